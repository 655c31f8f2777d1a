#include <arpa/inet.h>
#include <text/text.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <iterator>
#include <span>

#include "IscsiUtil/IscsiTools.h"
#include "IscsiUtil/Refusal.h"

namespace IscsiUtil {

using NodeCtl::Storage::ExtendedBool;
using NodeCtl::Storage::iScsiChapType;
using NodeCtl::Storage::iScsiDigestType;
using NodeCtl::Storage::iScsiNetworkPortalStatus;
using NodeCtl::Storage::iScsiPortErrorCodes;

namespace {

// Each word stands at its number; a number without a word has null.
constexpr const char* kLevels[] = {nullptr, "prohibited", "discouraged", "preferred", "required"};
constexpr const char* kImaDigests[] = {"none", "crc32c"};
constexpr const char* kExtendedBools[] = {"false", "true"};
constexpr const char* kPathStatuses[] = {"unused", "standby", "active", "last path"};
constexpr const char* kDiscoveryStatuses[] = {"Discovery Completed", "Discovery Timeout",
                                              "Discovery Completed, Some iSCSI Targets failed to login."};

/// The word at @p number; @p otherwise where there is none, as for every negative number.
const char* WordAt(std::span<const char* const> words, long long number, const char* otherwise) {
  if (number < 0 || number >= std::ssize(words)) return otherwise;
  const char* const word = words[static_cast<std::size_t>(number)];
  return word == nullptr ? otherwise : word;
}

/// The level that @p word names; @p refusal is thrown where it names none.
int LevelFrom(const std::string& word, const char* refusal) {
  for (int number = 0; number < std::ssize(kLevels); ++number) {
    if (kLevels[number] != nullptr && word == kLevels[number]) return number;
  }
  Refuse(refusal);
}

/// The same the other way.
const char* LevelWord(int number, const char* refusal) {
  const char* const word = WordAt(kLevels, number, nullptr);
  if (word == nullptr) Refuse(refusal);
  return word;
}

constexpr char kInvalidDigest[] = "Invalid digest value";
constexpr char kInvalidChapLevel[] = "Invalid Chap Level value";

}  // namespace

std::string IscsiTools::GetStringFromDigest(iScsiDigestType digest) {
  return LevelWord(static_cast<int>(digest), kInvalidDigest);
}

iScsiDigestType IscsiTools::GetDigestFromString(const std::string& word) {
  return static_cast<iScsiDigestType>(LevelFrom(word, kInvalidDigest));
}

std::string IscsiTools::GetStringFromChapType(iScsiChapType level) {
  return LevelWord(static_cast<int>(level), kInvalidChapLevel);
}

iScsiChapType IscsiTools::GetChapTypeFromString(const std::string& word) {
  return static_cast<iScsiChapType>(LevelFrom(word, kInvalidChapLevel));
}

std::string IscsiTools::GetStringFromImaDigest(IMA_DIGEST_TYPE digest) {
  const char* const word = WordAt(kImaDigests, digest, nullptr);
  if (word == nullptr) Refuse(kInvalidDigest);
  return word;
}

std::string IscsiTools::ConvertExtendedBoolToString(ExtendedBool value) {
  return WordAt(kExtendedBools, static_cast<int>(value), "unknown");
}

std::string IscsiTools::GetStringFromComplianceCode(iScsiPortErrorCodes code) {
  return code == iScsiPortErrorCodes::Compliant ? "compliant" : "non-compliant";
}

std::string IscsiTools::GetStringFromPathStatus(iScsiNetworkPortalStatus status) {
  return WordAt(kPathStatuses, static_cast<int>(status), "unknown");
}

std::string IscsiTools::GetStringFromDiscoveryStatus(iScsiInterface::iScsiDiscoveryStatus status) {
  return WordAt(kDiscoveryStatuses, static_cast<int>(status), "unknown");
}

const char* IscsiTools::GetStringFromImaIpAddress(const IMA_IP_ADDRESS* address) {
  static char text[INET6_ADDRSTRLEN];
  static_assert(sizeof text == 46);
  std::memset(text, 0, sizeof text);
  const IMA_BYTE* bytes = address->ipAddress;
  if (!address->ipv4Address) return inet_ntop(AF_INET6, bytes, text, sizeof text);
  if (inet_ntop(AF_INET, bytes, text, sizeof text) == nullptr) {
    std::snprintf(text, sizeof text, "%u.%u.%u.%u", bytes[0], bytes[1], bytes[2], bytes[3]);
  }
  return text;
}

IMA_IP_ADDRESS* IscsiTools::GetImaIpAddressFromString(const char* text) {
  static IMA_IP_ADDRESS address;
  address = {};
  if (inet_pton(AF_INET, text, address.ipAddress) == 1) {
    address.ipv4Address = IMA_TRUE;
    return &address;
  }
  return inet_pton(AF_INET6, text, address.ipAddress) == 1 ? &address : nullptr;
}

IMA_STATUS IscsiTools::GetUtf8StringFromWideCharString(char* destination, const wchar_t* source,
                                                       unsigned int size) {
  char* converted = nullptr;
  if (!CodeSet_UTF32ToUTF8(source, &converted)) return IMA_ERROR_INVALID_PARAMETER;
  const std::unique_ptr<char, decltype(&std::free)> text(converted, &std::free);
  if (std::strlen(text.get()) >= size) return IMA_ERROR_INVALID_PARAMETER;
  std::strncpy(destination, text.get(), size);
  return IMA_STATUS_SUCCESS;
}

IMA_STATUS IscsiTools::GetWideCharStringFromUtf8String(wchar_t** destination, const char* source) {
  return CodeSet_UTF8ToUTF32(source, destination) ? IMA_STATUS_SUCCESS : IMA_ERROR_INVALID_PARAMETER;
}

}  // namespace IscsiUtil
