/// Values of network configuration from their texts in a host's record.
#pragma once

#include <NodeCtl/Network.h>

#include <string>

#include "host/Storage.h"

namespace corectl {

inline NodeCtl::Network::MacAddress MacAt(const host::Record& record, const char* path) {
  const std::string& text = record.GetString(path);
  return text.empty() ? NodeCtl::Network::MacAddress() : NodeCtl::Network::MacAddress(text);
}

/// The addresses under the keys ipv4Address, ipv4Netmask and ipv6Addresses below @p prefix.
NodeCtl::Network::IpConfig IpConfigAt(const host::Record& record, const std::string& prefix);

}  // namespace corectl
