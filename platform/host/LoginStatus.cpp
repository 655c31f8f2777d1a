#include "host/LoginStatus.h"

#include <cstdio>

#include "host/Network.h"

namespace host {

namespace {

struct StatusText {
  std::uint32_t status;
  const char* text;
};

/// RFC 7143 section 11.13.5, and what the initiator itself finds.
constexpr StatusText kTexts[] = {
    {kMovedTemporarily,
     "The requested iSCSI Target Name (ITN) has temporarily moved to the address provided."},
    {kMovedPermanently, "The requested ITN has permanently moved to the address provided."},
    {LoginResponse(0x0200), "Miscellaneous iSCSI initiator errors."},
    {kNotAuthenticated,
     "The initiator could not be successfully authenticated or target authentication is not supported."},
    {kNotAllowed, "The initiator is not allowed access to the given target."},
    {kNotFound, "The requested ITN does not exist at this address."},
    {LoginResponse(0x0204), "The requested ITN has been removed, and no forwarding address is provided."},
    {LoginResponse(0x0205), "The requested iSCSI version range is not supported by the target."},
    {LoginResponse(0x0206), "Too many connections on this SSID."},
    {kNameMissing, "Missing parameters (e.g., iSCSI Initiator Name and/or Target Name)."},
    {LoginResponse(0x0208), "Target does not support session spanning to this connection (address)."},
    {LoginResponse(0x0209), "Target does not support this type of session or not from this initiator."},
    {LoginResponse(0x020a), "Attempt to add a connection to a nonexistent session."},
    {LoginResponse(0x020b), "Invalid request type during login."},
    {LoginResponse(0x0300), "Target hardware or software error."},
    {LoginResponse(0x0301), "The iSCSI service or target is not currently operational."},
    {kOutOfResources, "The target has insufficient session, connection, or other resources."},
    {kNoAnswer, "Nothing answered."},
    {kNoWayOut, "The adapter has no network portal to go out by."},
    {kTargetUnproven, "The target did not prove who it is by mutual CHAP."},
    {kTargetWithoutChap, "CHAP is required here, and the target does none."},
    {kNoCommonDigest, "There is no digest that both sides take."},
    {kSessionExists, "There is such a session already."},
};

}  // namespace

std::string LoginStatusText(std::uint32_t status) {
  for (const StatusText& known : kTexts) {
    if (known.status == status) return known.text;
  }
  switch (status & 0xffffff00u) {
    case LoginResponse(0x0100):
      return "The target has moved.";
    case LoginResponse(0x0200):
      return "The target found an error of the initiator's.";
    case LoginResponse(0x0300):
      return "The target had an error of its own.";
    default:
      return "The status is none that RFC 7143 knows.";
  }
}

void FailedLogins::Note(const KnownTarget& target, std::uint32_t status) {
  if (status == kDone || status == kNotAsked || count_++ > 0) return;
  target_ = target.object.record.GetString("name");
  status_ = status;
}

std::optional<Error> FailedLogins::GetError() const {
  if (count_ == 0) return {};
  // Of what the target said, Status-Class and Status-Detail are shown as documents have them.
  const bool isResponse = (status_ & 0xffff0000u) == LoginResponse(0);
  char word[16];
  std::snprintf(word, sizeof word, isResponse ? "0x%04x" : "0x%08x",
                static_cast<unsigned>(isResponse ? status_ & 0xffffu : status_));
  std::string text =
      "The login to " + target_ + " failed with status " + word + ": " + LoginStatusText(status_);
  if (count_ == 2) text += " Another login failed as well.";
  if (count_ > 2) text += " " + std::to_string(count_ - 1) + " other logins failed as well.";
  const bool isSilence = status_ == kNoAnswer || status_ == kNoWayOut;
  return Error(isSilence ? Error::Kind::NoAnswer : Error::Kind::LoginRefused, text);
}

}  // namespace host
