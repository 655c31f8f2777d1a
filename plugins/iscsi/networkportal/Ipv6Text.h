/// IPv6 addresses as the network portal commands show and judge them.
#pragma once

#include <NodeCtl/Network.h>
#include <arpa/inet.h>

#include <optional>
#include <string>
#include <vector>

namespace TessaroCli::IscsiNamespace {

/// Each network as ADDRESS/PREFIX with a blank behind it, the last one too.
inline std::string Ipv6Text(const NodeCtl::Network::IpConfig& ipConfig) {
  std::string text;
  for (const NodeCtl::Network::Ipv6Network& network : ipConfig.GetIpv6Network()) {
    text += network.GetAddress().GetStringAddress() + '/' + std::to_string(network.GetNetmask()) + ' ';
  }
  return text;
}

/// True for an address inside fe80::/10 (RFC 4291 section 2.5.6); nothing for a text that is no IPv6 address.
inline std::optional<bool> IsLinkLocal(const std::string& address) {
  in6_addr binary;
  if (inet_pton(AF_INET6, address.c_str(), &binary) != 1) return std::nullopt;
  return binary.s6_addr[0] == 0xfe && (binary.s6_addr[1] & 0xc0) == 0x80;
}

}  // namespace TessaroCli::IscsiNamespace
