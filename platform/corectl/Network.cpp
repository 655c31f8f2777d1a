#include <NodeCtl/Network.h>

#include <ostream>

#include "corectl/Operation.h"
#include "host/Formats.h"

namespace NodeCtl::Network {

namespace {

template <class Bytes>
Bytes Parsed(const std::optional<Bytes>& bytes, const std::string& text, const char* what) {
  if (!bytes) corectl::RefuseValue(host::Quoted(text) + " is not " + what + ".");
  return *bytes;
}

/// The prefix length behind the slash of @p text; -1 where there is none.
int PrefixLength(const std::string& text) {
  const std::size_t slash = text.find('/');
  if (slash == text.npos) return -1;
  const std::string digits = text.substr(slash + 1);
  if (digits.empty() || digits.size() > 3 || digits.find_first_not_of("0123456789") != digits.npos) return -1;
  if (digits.size() > 1 && digits[0] == '0') return -1;
  const int length = std::stoi(digits);
  return length <= 128 ? length : -1;
}

}  // namespace

Ipv4Address::Ipv4Address(const std::string& text)
    : bytes_(Parsed(host::ParseIpv4(text), text, "an IPv4 address")) {}
std::string Ipv4Address::GetStringAddress() const { return host::FormatIpv4(bytes_); }

Ipv6Address::Ipv6Address(const std::string& text)
    : bytes_(Parsed(host::ParseIpv6(text), text, "an IPv6 address")) {}
std::string Ipv6Address::GetStringAddress() const { return host::FormatIpv6(bytes_); }

Ipv6Network::Ipv6Network(const std::string& text) {
  if (!IsValidAddressAndNetmask(text)) {
    corectl::RefuseValue(host::Quoted(text) +
                         " is not an IPv6 address, a slash and a prefix length from 0 to 128.");
  }
  address_ = Ipv6Address(text.substr(0, text.find('/')));
  prefixLength_ = PrefixLength(text);
}

Ipv6Network::Ipv6Network(const Ipv6Address& address, int prefixLength, Ipv6AddressType type)
    : address_(address), prefixLength_(prefixLength), type_(type) {
  if (prefixLength < 0 || prefixLength > 128) {
    corectl::RefuseValue(host::Quoted(std::to_string(prefixLength)) +
                         " is not a prefix length from 0 to 128.");
  }
}

bool Ipv6Network::IsValidAddressAndNetmask(std::string text) {
  return PrefixLength(text) >= 0 && host::ParseIpv6(std::string_view(text).substr(0, text.find('/')));
}

HostAddress::HostAddress(const std::string& text) : text_(text) {
  if (text.empty()) return;
  if (host::ParseIpv4(text)) {
    family_ = AddressFamily::Ipv4;
  } else if (const auto bytes = host::ParseIpv6(text)) {
    family_ = AddressFamily::Ipv6;
    text_ = host::FormatIpv6(*bytes);
  } else if (!host::IsHostName(text)) {
    corectl::RefuseValue(host::Quoted(text) + " is not an IPv4 address, an IPv6 address or a host name.");
  }
}

std::ostream& operator<<(std::ostream& stream, const HostAddress& address) {
  return stream << address.GetStringAddress();
}

MacAddress::MacAddress(const std::string& text)
    : bytes_(Parsed(host::ParseMac(text), text, "a MAC address")), valid_(true) {}
std::string MacAddress::GetStringAddress() const { return host::FormatMac(bytes_); }

}  // namespace NodeCtl::Network
