#include "linux/Interfaces.h"

#include <arpa/inet.h>
#include <ifaddrs.h>
#include <net/if.h>
#include <net/if_arp.h>
#include <netinet/in.h>

#include <algorithm>
#include <array>
#include <bit>
#include <charconv>
#include <memory>

#include "linux/Attributes.h"

namespace linux {

namespace {

template <class Address>
int BitsIn(const Address& mask) {
  int bits = 0;
  for (const unsigned char byte : std::bit_cast<std::array<unsigned char, sizeof mask>>(mask))
    bits += std::popcount(byte);
  return bits;
}

/// Adds an address to the interface that has it.
void Add(const ifaddrs& entry, std::vector<NetworkInterface>& interfaces) {
  const auto found = std::ranges::find(interfaces, entry.ifa_name, &NetworkInterface::name);
  if (found == interfaces.end() || entry.ifa_addr == nullptr || entry.ifa_netmask == nullptr) return;
  char text[INET6_ADDRSTRLEN];
  if (entry.ifa_addr->sa_family == AF_INET) {
    const auto& address = reinterpret_cast<const sockaddr_in*>(entry.ifa_addr)->sin_addr;
    const auto& mask = reinterpret_cast<const sockaddr_in*>(entry.ifa_netmask)->sin_addr;
    found->ipv4.push_back({inet_ntop(AF_INET, &address, text, sizeof text), BitsIn(mask)});
  } else if (entry.ifa_addr->sa_family == AF_INET6) {
    const auto& address = reinterpret_cast<const sockaddr_in6*>(entry.ifa_addr)->sin6_addr;
    const auto& mask = reinterpret_cast<const sockaddr_in6*>(entry.ifa_netmask)->sin6_addr;
    found->ipv6.push_back({inet_ntop(AF_INET6, &address, text, sizeof text), BitsIn(mask)});
  }
}

}  // namespace

std::vector<NetworkInterface> ReadInterfaces() {
  std::vector<NetworkInterface> interfaces;
  for (const std::string& name : Names("/sys/class/net")) {
    const std::string folder = "/sys/class/net/" + name + "/";
    const std::string flagText = Attribute(folder + "flags");
    if (!flagText.starts_with("0x")) continue;  // a file, as bonding's, and no interface
    unsigned flags = 0;
    std::from_chars(flagText.data() + 2, flagText.data() + flagText.size(), flags, 16);
    NetworkInterface& interface = interfaces.emplace_back();
    interface.name = name;
    interface.isLoopback = (flags & IFF_LOOPBACK) != 0;
    interface.isUp = (flags & IFF_UP) != 0;
    interface.hasLink = Attribute(folder + "carrier") == "1";
    if (NumberAttribute(folder + "type") == ARPHRD_ETHER) interface.mac = Attribute(folder + "address");
    interface.mtu = NumberAttribute(folder + "mtu");
    interface.speed = std::max<std::int64_t>(0, NumberAttribute(folder + "speed"));
  }
  ifaddrs* addresses = nullptr;
  if (getifaddrs(&addresses) != 0) return interfaces;
  const std::unique_ptr<ifaddrs, decltype(&freeifaddrs)> owner(addresses, freeifaddrs);
  for (const ifaddrs* entry = addresses; entry != nullptr; entry = entry->ifa_next) Add(*entry, interfaces);
  return interfaces;
}

}  // namespace linux
