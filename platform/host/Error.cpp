#include "host/Error.h"

#include <ima/ima.h>

#include <cerrno>
#include <cstdio>

namespace host {

namespace {

using Kind = Error::Kind;

/// In the order of Kind.
constexpr struct {
  Kind kind;
  std::string_view code;
  std::uint32_t imaStatus;
} kKinds[] = {
    {Kind::Failed, "failed", IMA_ERROR_UNEXPECTED_OS_ERROR},
    {Kind::NotFound, "not-found", IMA_ERROR_OBJECT_NOT_FOUND},
    {Kind::Exists, "exists", IMA_ERROR_INVALID_PARAMETER},
    {Kind::Invalid, "invalid", IMA_ERROR_INVALID_PARAMETER},
    {Kind::OutOfRange, "out-of-range", IMA_ERROR_INVALID_PARAMETER},
    {Kind::NotSettable, "not-settable", IMA_ERROR_INVALID_PARAMETER},
    {Kind::NotSupported, "not-supported", IMA_ERROR_NOT_SUPPORTED},
    {Kind::WrongObject, "invalid", IMA_ERROR_INCORRECT_OBJECT_TYPE},
    {Kind::WrongState, "wrong-state", IMA_ERROR_INVALID_PARAMETER},
    {Kind::InUse, "in-use", IMA_ERROR_INVALID_PARAMETER},
    {Kind::TooMany, "too-many", IMA_ERROR_INVALID_PARAMETER},
    {Kind::Busy, "busy", IMA_ERROR_UNEXPECTED_OS_ERROR},
    {Kind::Denied, "denied", IMA_ERROR_UNEXPECTED_OS_ERROR},
    {Kind::Damaged, "damaged", IMA_ERROR_UNEXPECTED_OS_ERROR},
    {Kind::DamagedFile, "damaged", IMA_ERROR_UNEXPECTED_OS_ERROR},
    {Kind::NoSpace, "no-space", IMA_ERROR_UNEXPECTED_OS_ERROR},
    {Kind::NoMemory, "no-memory", IMA_ERROR_INSUFFICIENT_MEMORY},
    {Kind::LoginRefused, "login-refused", IMA_ERROR_UNKNOWN_ERROR},
    {Kind::NoAnswer, "no-answer", IMA_ERROR_UNKNOWN_ERROR},
};
constexpr bool AreInOrder() {
  for (std::size_t i = 0; i < std::size(kKinds); ++i) {
    if (static_cast<std::size_t>(kKinds[i].kind) != i) return false;
  }
  return true;
}
static_assert(AreInOrder());

Kind KindOfAnswer(std::uint32_t imaStatus) {
  switch (imaStatus) {
    case IMA_ERROR_NOT_SUPPORTED:
      return Kind::NotSupported;
    case IMA_ERROR_INSUFFICIENT_MEMORY:
      return Kind::NoMemory;
    case IMA_ERROR_INVALID_PARAMETER:
    case IMA_ERROR_INVALID_OBJECT_TYPE:
    case IMA_ERROR_INCORRECT_OBJECT_TYPE:
      return Kind::Invalid;
    case IMA_ERROR_OBJECT_NOT_FOUND:
      return Kind::NotFound;
    case IMA_ERROR_SYNC_TIMEOUT:
      return Kind::NoAnswer;
    default:
      return Kind::Failed;
  }
}

}  // namespace

std::string ImaStatusText(std::uint32_t status) {
  char text[16];
  std::snprintf(text, sizeof text, "0x%08x", static_cast<unsigned>(status));
  return text;
}

Error::Error(std::uint32_t imaStatus)
    : std::runtime_error("The host description has it answered with " + ImaStatusText(imaStatus) + "."),
      kind_(KindOfAnswer(imaStatus)),
      answer_(imaStatus) {}

Kind Error::KindOfSystem(int error) {
  switch (error) {
    case EACCES:
    case EPERM:
    case EROFS:
    case ELOOP:
      return Kind::Denied;
    case ENOSPC:
    case EDQUOT:
    case EFBIG:
      return Kind::NoSpace;
    case ENOENT:
    case ENOTDIR:
      return Kind::NotFound;
    case EBUSY:
    case EWOULDBLOCK:
      return Kind::Busy;
    default:
      return Kind::Failed;
  }
}

std::string_view Error::Code() const { return kKinds[static_cast<std::size_t>(kind_)].code; }

std::uint32_t Error::ImaStatus() const {
  return answer_ != 0 ? answer_ : kKinds[static_cast<std::size_t>(kind_)].imaStatus;
}

}  // namespace host
