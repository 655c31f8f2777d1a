#include <arpa/inet.h>

#include <cstdlib>
#include <new>
#include <optional>
#include <sstream>

#include "IscsiUtil/IscsiTools.h"
#include "IscsiUtil/Refusal.h"

namespace IscsiUtil {

using NodeCtl::Network::AddressFamily;
using NodeCtl::Network::HostAddress;
using NodeCtl::Network::IpConfig;
using NodeCtl::Network::Ipv4Address;
using NodeCtl::Network::Ipv6Address;
using NodeCtl::Storage::TargetAddress;

namespace {

constexpr std::uint16_t kDefaultPort = 3260;

bool IsIpv6(const std::string& text) {
  in6_addr address;
  return inet_pton(AF_INET6, text.c_str(), &address) == 1;
}

/// Digits and nothing else, at most 65535.
std::optional<std::uint16_t> PortFrom(const std::string& text) {
  if (text.empty() || text[0] < '0' || text[0] > '9') return std::nullopt;
  char* end = nullptr;
  const unsigned long port = std::strtoul(text.c_str(), &end, 10);
  if (end != text.c_str() + text.size() || port > 65535) return std::nullopt;
  return static_cast<std::uint16_t>(port);
}

/// [IPV6]:PORT
TargetAddress FromBrackets(const std::string& text) {
  constexpr char kNoPort[] = "Invalid address, expected format is [ipv6]:port)";
  const std::size_t closing = text.find(']');
  if (closing == text.npos) Refuse("Invalid address (expected format is [ipv6]:port)");
  const std::string address = text.substr(1, closing - 1);
  if (closing + 1 == text.size() || text[closing + 1] != ':') Refuse(kNoPort);
  if (!IsIpv6(address)) Refuse("Invalid IPv6 address");
  const auto port = PortFrom(text.substr(closing + 2));
  if (!port) Refuse("Invalid port number");
  return {HostAddress(address), *port};
}

}  // namespace

TargetAddress IscsiTools::GetTargetAddressFromString(const std::string& text) {
  if (text.starts_with('[')) return FromBrackets(text);
  if (IsIpv6(text)) return {HostAddress(text), kDefaultPort};
  const std::size_t colon = text.rfind(':');
  const std::string name = text.substr(0, colon);
  if (name.find(':') != name.npos) Refuse("Invalid address");
  const HostAddress host(name);
  if (colon == text.npos) return {host, kDefaultPort};
  const auto port = PortFrom(text.substr(colon + 1));
  if (!port) Refuse("Invalid port number.");
  return {host, *port};
}

std::string IscsiTools::GetStringFromTargetAddress(const TargetAddress& address) {
  // How a host is written is the library's, by its stream operator. Making a stream costs far more than what
  // is written to it.
  static std::ostringstream stream;
  stream.clear();
  stream.str({});
  stream.flags(std::ios::dec | std::ios::skipws);  // another library's operator may leave others
  stream.fill(' ');
  stream.width(0);
  stream << address.host;
  if (stream.bad()) throw std::bad_alloc();
  const bool bracketed = address.host.GetFamily() == AddressFamily::Ipv6;
  std::string text(bracketed ? "[" : "");
  text.append(stream.view()).append(bracketed ? "]:" : ":").append(std::to_string(address.port));
  return text;
}

IpConfig IscsiTools::GetIpConfigFromString(const std::string& address, const std::string& netmask) {
  IpConfig config;
  config.SetUseDhcp(false);
  config.SetIpv4Address(Ipv4Address(address));
  config.SetIpv4Netmask(Ipv4Address(netmask));
  return config;
}

Ipv4Address IscsiTools::GetIpv4AddressFromString(const std::string& text) { return Ipv4Address(text); }

Ipv6Address IscsiTools::GetIpv6AddressFromString(const std::string& text) { return Ipv6Address(text); }

}  // namespace IscsiUtil
