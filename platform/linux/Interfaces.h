/// The network interfaces of this machine.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#pragma GCC visibility push(default)

namespace linux {

struct InterfaceAddress {
  std::string address;  // without a zone
  int prefixLength = 0;
  bool operator==(const InterfaceAddress&) const = default;
};

struct NetworkInterface {
  std::string name;        // such as "eth1"
  std::string mac;         // empty where it has none
  std::int64_t mtu = 0;    // bytes
  std::int64_t speed = 0;  // Mbit/s; 0 where it is not known
  bool isUp = false;
  bool hasLink = false;
  bool isLoopback = false;
  std::vector<InterfaceAddress> ipv4;
  std::vector<InterfaceAddress> ipv6;  // link-local ones too
};

/// All of them, by name.
std::vector<NetworkInterface> ReadInterfaces();

}  // namespace linux

#pragma GCC visibility pop
