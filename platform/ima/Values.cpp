#include "ima/Values.h"

#include <algorithm>
#include <cstdio>
#include <cwchar>
#include <iterator>

#include "host/Formats.h"
#include "host/Storage.h"
#include "ima/Operation.h"

namespace ima {

namespace {

constexpr std::string_view kTypes[] = {"unknown", "plugin",       "node",          "lhba",       "phba",
                                       "portal",  "portal group", "pnp",           "lnp",        "target",
                                       "lu",      "address",      "static target", "connection", "session"};

std::string TypeText(IMA_OBJECT_TYPE type) {
  return type < std::size(kTypes) ? std::string(kTypes[type]) : "type " + std::to_string(type);
}

}  // namespace

host::Argument OidArgument(const IMA_OID& oid) {
  if (oid.objectType < std::size(kTypes)) {
    return host::Argument::Numbered(kTypes[oid.objectType], Id(oid));
  }
  return host::Argument::Plain(TypeText(oid.objectType) + " " + std::to_string(oid.objectSequenceNumber));
}

std::int64_t IdOfType(const IMA_OID& oid, IMA_OBJECT_TYPE type) {
  if (oid.objectType == type) return Id(oid);
  throw host::Error(host::Error::Kind::WrongObject, "The object is no " + TypeText(type) + ".");
}

void SetWide(IMA_WCHAR* destination, std::size_t size, std::string_view text) {
  if (text.size() < size && host::IsAscii(text)) {  // as nearly all are
    *std::copy(text.begin(), text.end(), destination) = L'\0';
    return;
  }
  const std::wstring wide = host::WideFromUtf8(text).value_or(L"");
  const std::size_t length = wide.copy(destination, size - 1);
  destination[length] = L'\0';
}

std::string Narrow(const IMA_WCHAR* wide) {
  const auto text = host::Utf8FromWide(wide);
  if (!text) throw host::Error(host::Error::Kind::Invalid, "The name is no UTF-32 text.");
  return *text;
}

IMA_IP_ADDRESS Address(std::string_view text) {
  IMA_IP_ADDRESS address{};
  if (const auto ipv4 = host::ParseIpv4(text)) {
    address.ipv4Address = IMA_TRUE;
    std::copy(ipv4->begin(), ipv4->end(), address.ipAddress);
  } else if (const auto ipv6 = host::ParseIpv6(text)) {
    std::copy(ipv6->begin(), ipv6->end(), address.ipAddress);
  }
  return address;
}

std::string AddressText(const IMA_IP_ADDRESS& address) {
  if (address.ipv4Address) {
    host::Ipv4Bytes bytes;
    std::copy_n(address.ipAddress, bytes.size(), bytes.begin());
    return host::FormatIpv4(bytes);
  }
  host::Ipv6Bytes bytes;
  std::copy_n(address.ipAddress, bytes.size(), bytes.begin());
  return host::FormatIpv6(bytes);
}

IMA_DATETIME Time(const std::string& text) {
  IMA_DATETIME time{};
  std::sscanf(text.c_str(), "%d-%d-%d %d:%d:%d", &time.tm_year, &time.tm_mon, &time.tm_mday, &time.tm_hour,
              &time.tm_min, &time.tm_sec);
  time.tm_year -= 1900;
  time.tm_mon -= 1;
  return time;
}

}  // namespace ima
