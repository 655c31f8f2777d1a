#include <arpa/inet.h>
#include <text/text.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <iterator>
#include <span>

#include "IscsiUtil/IscsiTools.h"

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

/// The word at @p number; @p otherwise where there is none.
template <class Number>
const char* WordAt(std::span<const char* const> words, Number number, const char* otherwise) {
  const auto index = static_cast<std::size_t>(number);
  return index < words.size() && words[index] != nullptr ? words[index] : otherwise;
}

/// The number of @p word; the count of words where it is none of them.
std::size_t NumberOf(std::span<const char* const> words, const std::string& word) {
  std::size_t number = 0;
  while (number < words.size() && (words[number] == nullptr || word != words[number])) ++number;
  return number;
}

constexpr char kInvalidDigest[] = "Invalid digest value";
constexpr char kInvalidChapLevel[] = "Invalid Chap Level value";

}  // namespace

std::string IscsiTools::GetStringFromDigest(iScsiDigestType digest) {
  const char* word = WordAt(kLevels, digest, nullptr);
  if (word == nullptr) Refuse(kInvalidDigest);
  return word;
}

iScsiDigestType IscsiTools::GetDigestFromString(const std::string& word) {
  const std::size_t number = NumberOf(kLevels, word);
  if (number == std::size(kLevels)) Refuse(kInvalidDigest);
  return static_cast<iScsiDigestType>(number);
}

std::string IscsiTools::GetStringFromChapType(iScsiChapType level) {
  const char* word = WordAt(kLevels, level, nullptr);
  if (word == nullptr) Refuse(kInvalidChapLevel);
  return word;
}

iScsiChapType IscsiTools::GetChapTypeFromString(const std::string& word) {
  const std::size_t number = NumberOf(kLevels, word);
  if (number == std::size(kLevels)) Refuse(kInvalidChapLevel);
  return static_cast<iScsiChapType>(number);
}

std::string IscsiTools::GetStringFromImaDigest(IMA_DIGEST_TYPE digest) {
  const char* word = WordAt(kImaDigests, digest, nullptr);
  if (word == nullptr) Refuse(kInvalidDigest);
  return word;
}

std::string IscsiTools::ConvertExtendedBoolToString(ExtendedBool value) {
  return WordAt(kExtendedBools, value, "unknown");
}

std::string IscsiTools::GetStringFromComplianceCode(iScsiPortErrorCodes code) {
  return code == iScsiPortErrorCodes::Compliant ? "compliant" : "non-compliant";
}

std::string IscsiTools::GetStringFromPathStatus(iScsiNetworkPortalStatus status) {
  return WordAt(kPathStatuses, status, "unknown");
}

std::string IscsiTools::GetStringFromDiscoveryStatus(iScsiInterface::iScsiDiscoveryStatus status) {
  return WordAt(kDiscoveryStatuses, status, "unknown");
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

const IMA_IP_ADDRESS* IscsiTools::GetImaIpAddressFromString(const char* text) {
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
