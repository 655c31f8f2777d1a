// The network configuration of an adapter: what it is, and what it takes.

#include <algorithm>
#include <bit>

#include "corectl/Adapter.h"
#include "corectl/Members.h"
#include "corectl/NetworkText.h"
#include "host/Formats.h"

namespace corectl {

namespace {

using host::Quoted;
using NetworkMember = Member<iScsiNetworkProperties>;

constexpr NetworkMember kNetworkMembers[] = {
    {"network/ipv4Enabled", &iScsiNetworkProperties::ipv4Enabled},
    {"network/useDhcpv4", &iScsiNetworkProperties::useDhcpv4},
    {"capabilities/IPv6 Supported", &iScsiNetworkProperties::ipv6Supported},
    {"network/ipv6Enabled", &iScsiNetworkProperties::ipv6Enabled},
    {"network/useDhcpv6", &iScsiNetworkProperties::useDhcpv6},
    {"network/useRouterAdvertisement", &iScsiNetworkProperties::useRouterAdvertisement},
    {"network/useLinkLocalAutoConfiguration", &iScsiNetworkProperties::useLinkLocalAutoConfiguration},
    {"network/ipv6PrefixLength", &iScsiNetworkProperties::ipv6PrefixLength},
    {"network/ipv6MaxStaticAddresses", &iScsiNetworkProperties::ipv6MaxStaticAddresses},
    {"network/domainName", &iScsiNetworkProperties::domainName},
    {"network/primaryDns", &iScsiNetworkProperties::primaryDns},
    {"network/secondaryDns", &iScsiNetworkProperties::secondaryDns},
};

constexpr char kAddresses[] = "network/ipv6Addresses";

/// Refuses a change of @p what where the adapter lacks the capability to set it.
void RequireSettable(const host::Object& adapter, const char* capability, const char* what) {
  if (adapter.record.GetBool(std::string("capabilities/") + capability)) return;
  Deny(Why::NotSettable, std::string(what) + " of the adapter " + Quoted(adapter.name) + " is not settable.");
}

void RequireIpv6(const host::Object& adapter) {
  if (adapter.record.GetBool("capabilities/IPv6 Supported")) return;
  Deny(Why::NotSupported, "The adapter " + Quoted(adapter.name) + " does not support IPv6.");
}

void RequireStaticIpv4(const host::Object& adapter, const char* what) {
  if (!adapter.record.GetBool("network/useDhcpv4")) return;
  Deny(Why::WrongState, std::string(what) + " of the adapter " + Quoted(adapter.name) +
                            " comes from DHCP. Switch DHCPv4 off first.");
}

host::Ipv4Bytes RequireIpv4(const std::string& text) {
  const auto bytes = host::ParseIpv4(text);
  if (!bytes) Deny(Why::Invalid, Quoted(text) + " is not an IPv4 address.");
  return *bytes;
}

host::Ipv6Bytes RequireIpv6Address(const std::string& text) {
  const auto bytes = host::ParseIpv6(text);
  if (!bytes) Deny(Why::Invalid, Quoted(text) + " is not an IPv6 address.");
  return *bytes;
}

std::uint32_t Number(const host::Ipv4Bytes& bytes) {
  return std::uint32_t{bytes[0]} << 24 | std::uint32_t{bytes[1]} << 16 | std::uint32_t{bytes[2]} << 8 |
         bytes[3];
}

/// Ones, then zeros; at least one of the former.
bool IsMask(std::uint32_t mask) { return mask != 0 && std::countl_one(mask) + std::countr_zero(mask) == 32; }

bool IsLinkLocal(const host::Ipv6Bytes& bytes) { return bytes[0] == 0xfe && (bytes[1] & 0xc0) == 0x80; }

/// Refuses what no single interface can have as its own address, or as that of a neighbour.
void RequireUnicast(const std::string& text, const host::Ipv4Bytes& bytes) {
  if (bytes[0] == 0 || bytes[0] == 127 || bytes[0] >= 224)
    Deny(Why::Invalid, Quoted(text) + " is not a unicast address.");
}
void RequireUnicast(const std::string& text, const host::Ipv6Bytes& bytes) {
  const bool tiny = std::all_of(bytes.begin(), bytes.end() - 1, [](int byte) { return byte == 0; });
  if (bytes[0] == 0xff || (tiny && bytes[15] <= 1))
    Deny(Why::Invalid, Quoted(text) + " is not a unicast address.");
}

/// An IPv6 address of the adapter, by its place in the list.
std::string AddressPath(std::size_t i) { return std::string(kAddresses) + '/' + std::to_string(i); }

/// The place of the address in the list of @p record; empty where it is not there.
std::string FindIpv6Address(const host::Record& record, const host::Ipv6Bytes& bytes) {
  for (std::size_t i = 0; i < record.GetSize(kAddresses); ++i) {
    if (RequireIpv6Address(record.GetString(AddressPath(i) + "/address")) == bytes) return AddressPath(i);
  }
  return {};
}

// Commands show what is in effect. What they ask for again while it waits is as good as done.

/// Adds a static address, where the adapter takes it.
void AddIpv6Address(host::Record& record, const host::Record& inEffect, const std::string& text,
                    const host::Ipv6Bytes& bytes, int prefixLength) {
  RequireUnicast(text, bytes);
  if (const std::string place = FindIpv6Address(record, bytes); !place.empty()) {
    const bool waits = FindIpv6Address(inEffect, bytes).empty();
    if (waits && record.GetInt(place + "/prefixLength") == prefixLength) return;
    Deny(Why::Exists, "The adapter has the address " + Quoted(text) + " already.");
  }
  const bool linkLocal = IsLinkLocal(bytes);
  if (record.GetBool(linkLocal ? "network/useLinkLocalAutoConfiguration"
                               : "network/useRouterAdvertisement")) {
    Deny(Why::WrongState,
         Quoted(text) + (linkLocal ? " is link-local, and that address is configured automatically."
                                   : " is routable, and those addresses come from router advertisements."));
  }
  int routableStatic = 0;
  for (std::size_t i = 0; i < record.GetSize(kAddresses); ++i) {
    const std::string& other = record.GetString(AddressPath(i) + "/address");
    const host::Ipv6Bytes otherBytes = RequireIpv6Address(other);
    if (linkLocal && IsLinkLocal(otherBytes)) {
      Deny(Why::TooMany,
           "The adapter has the link-local address " + Quoted(other) + " already, and takes only one.");
    }
    if (!IsLinkLocal(otherBytes) && record.GetInt(AddressPath(i) + "/type") == 0) ++routableStatic;
  }
  const int limit = record.GetInt("network/ipv6MaxStaticAddresses");
  if (!linkLocal && limit != -1 && routableStatic >= limit) {
    Deny(Why::TooMany, "The adapter takes at most " + std::to_string(limit) + " static routable addresses.");
  }
  host::Record added;
  added.Set("address", host::FormatIpv6(bytes));
  added.Set("prefixLength", prefixLength);
  added.Set("type", static_cast<int>(Network::Ipv6AddressType::Static));
  record.Append(kAddresses, added);
}

void RemoveIpv6Address(host::Record& record, const host::Record& inEffect, const std::string& text,
                       const host::Ipv6Bytes& bytes, int prefixLength) {
  const std::string configured = FindIpv6Address(record, bytes);
  const host::Record& known = configured.empty() ? inEffect : record;
  const std::string place = FindIpv6Address(known, bytes);
  if (place.empty()) Deny(Why::NotFound, "The adapter does not have the address " + Quoted(text) + ".");
  const int length = known.GetInt(place + "/prefixLength");
  if (length != prefixLength) {
    Deny(Why::NotFound, "The prefix of the address " + Quoted(text) + " has " + std::to_string(length) +
                            " bits, not " + std::to_string(prefixLength) + ".");
  }
  if (!configured.empty()) record.Erase(configured);
}

struct ConfigMethod {
  const char* capability;
  const char* what;
  const char* path;
};
/// By the numbers of iScsiIpv6ConfigMethod, less one.
constexpr ConfigMethod kConfigMethods[] = {
    {"IPv6 Linklocal Auto Configuration Method Settable", "Auto configuration of the link-local address",
     "network/useLinkLocalAutoConfiguration"},
    {"IPv6 DHCP Configuration Method Settable", "DHCPv6 configuration", "network/useDhcpv6"},
    {"IPv6 Router Advertisement Configuration Method Settable", "Configuration by router advertisement",
     "network/useRouterAdvertisement"},
};

struct DnsServer {
  const char* capability;
  const char* what;
  const char* path;
};
constexpr DnsServer kPrimaryDns = {"Primary DNS Settable", "The primary DNS server", "network/primaryDns"};
constexpr DnsServer kSecondaryDns = {"Secondary DNS Settable", "The secondary DNS server",
                                     "network/secondaryDns"};

/// One that stays as it is need not be settable.
void SetDnsServer(host::Object& adapter, const DnsServer& server, const std::string& address) {
  if (adapter.record.GetString(server.path) == address) return;
  RequireSettable(adapter, server.capability, server.what);
  if (!address.empty() && !host::ParseIpv4(address) && !host::ParseIpv6(address)) {
    Deny(Why::Invalid, Quoted(address) + " is not an IP address.");
  }
  adapter.record.Set(server.path, address);
}

}  // namespace

Network::IpConfig IpConfigAt(const host::Record& record, const std::string& prefix) {
  Network::IpConfig config;
  config.SetIpv4Address(Network::Ipv4Address(record.GetString(prefix + "ipv4Address")));
  config.SetIpv4Netmask(Network::Ipv4Address(record.GetString(prefix + "ipv4Netmask")));
  const std::string list = prefix + "ipv6Addresses";
  for (std::size_t i = 0; i < record.GetSize(list); ++i) {
    const std::string path = list + '/' + std::to_string(i);
    config.AddIpv6Network({Network::Ipv6Address(record.GetString(path + "/address")),
                           record.GetInt(path + "/prefixLength"),
                           static_cast<Network::Ipv6AddressType>(record.GetInt(path + "/type"))});
  }
  return config;
}

iScsiNetworkProperties Adapter::GetNetworkProperties() {
  return ref_.Read("GetNetworkProperties", [](host::Tree&, const host::Object& adapter) {
    iScsiNetworkProperties network;
    Fill(network, kNetworkMembers, adapter.record);
    network.ipConfig = IpConfigAt(adapter.record, "network/");
    network.ipConfig.SetUseDhcp(network.useDhcpv4);
    network.gateway = Network::Ipv4Address(adapter.record.GetString("network/gateway"));
    network.gateway6 = Network::Ipv6Address(adapter.record.GetString("network/gateway6"));
    return network;
  });
}

Adapter::iScsiStatus Adapter::SetIpv4Address(const std::string& address) {
  return Configure("SetIpv4Address", {address}, Setting::Network, [&](host::Object& adapter) {
    RequireStaticIpv4(adapter, "The IPv4 address");
    RequireUnicast(address, RequireIpv4(address));
    adapter.record.Set("network/ipv4Address", address);
  });
}

Adapter::iScsiStatus Adapter::SetIpv4SubnetMask(const std::string& mask) {
  return Configure("SetIpv4SubnetMask", {mask}, Setting::Network, [&](host::Object& adapter) {
    RequireSettable(adapter, "Subnet Mask Setttable", "The subnet mask");
    RequireStaticIpv4(adapter, "The subnet mask");
    if (!IsMask(Number(RequireIpv4(mask)))) {
      Deny(Why::Invalid,
           Quoted(mask) + " is not a subnet mask: its one bits must stand in front of its zero bits.");
    }
    adapter.record.Set("network/ipv4Netmask", mask);
  });
}

Adapter::iScsiStatus Adapter::SetIpv4Gateway(const Network::Ipv4Address& gateway) {
  const std::string text = gateway.GetStringAddress();
  return Configure("SetIpv4Gateway", {text}, Setting::Network, [&](host::Object& adapter) {
    RequireSettable(adapter, "Default Gateway Settable", "The default gateway");
    RequireStaticIpv4(adapter, "The default gateway");
    if (gateway != Network::Ipv4Address()) {
      RequireUnicast(text, gateway.GetBytes());
      const std::string& address = adapter.record.GetString("network/ipv4Address");
      const std::string& netmask = adapter.record.GetString("network/ipv4Netmask");
      const std::uint32_t mask = Number(RequireIpv4(netmask));
      if (mask == 0 || ((Number(gateway.GetBytes()) ^ Number(RequireIpv4(address))) & mask) != 0) {
        Deny(Why::WrongState, "The gateway " + Quoted(text) + " is not in the subnet of the address " +
                                  Quoted(address) + " with the mask " + Quoted(netmask) + ".");
      }
    }
    adapter.record.Set("network/gateway", text);
  });
}

Adapter::iScsiStatus Adapter::SetIpv6Gateway(const std::string& gateway) {
  return Configure("SetIpv6Gateway", {gateway}, Setting::Network, [&](host::Object& adapter) {
    RequireIpv6(adapter);
    RequireSettable(adapter, "IPv6 Default Gateway Settable", "The IPv6 default gateway");
    const host::Ipv6Bytes bytes = gateway.empty() ? host::Ipv6Bytes{} : RequireIpv6Address(gateway);
    if (bytes != host::Ipv6Bytes{}) RequireUnicast(gateway, bytes);
    adapter.record.Set("network/gateway6", host::FormatIpv6(bytes));
  });
}

Adapter::iScsiStatus Adapter::SetDnsServers(const std::string& primary, const std::string& secondary) {
  return Configure("SetDnsServers", {primary, secondary}, Setting::Network, [&](host::Object& adapter) {
    RequireStaticIpv4(adapter, "The list of DNS servers");
    SetDnsServer(adapter, kPrimaryDns, primary);
    SetDnsServer(adapter, kSecondaryDns, secondary);
  });
}

Adapter::iScsiStatus Adapter::SetIpv6Address(const std::string& address, int prefixLength, bool add) {
  const auto set = [&](host::Object& adapter, const host::Object& inEffect) {
    RequireIpv6(adapter);
    if (!adapter.record.GetBool("network/ipv6Enabled")) {
      Deny(Why::WrongState, "IPv6 is disabled on the adapter " + Quoted(adapter.name) + ".");
    }
    const host::Ipv6Bytes bytes = RequireIpv6Address(address);
    const int fixedLength = adapter.record.GetInt("network/ipv6PrefixLength");
    if (prefixLength < 0 || prefixLength > 128 || (add && fixedLength != -1 && prefixLength != fixedLength)) {
      Deny(Why::OutOfRange,
           "The prefix length " + std::to_string(prefixLength) + " is not " +
               (fixedLength == -1 ? "from 0 to 128."
                                  : std::to_string(fixedLength) + ", the only one of the adapter."));
    }
    (add ? AddIpv6Address : RemoveIpv6Address)(adapter.record, inEffect.record, address, bytes, prefixLength);
  };
  return Configure("SetIpv6Address", {address, prefixLength, add}, Setting::Network, set);
}

Adapter::iScsiStatus Adapter::SetIpv6ConfigMethod(const int& method, bool enable) {
  return Configure("SetIpv6ConfigMethod", {method, enable}, Setting::Network, [&](host::Object& adapter) {
    RequireIpv6(adapter);
    if (method < 1 || method > static_cast<int>(std::size(kConfigMethods))) {
      Deny(Why::Invalid, "There is no IPv6 configuration method " + std::to_string(method) + ".");
    }
    const ConfigMethod& known = kConfigMethods[method - 1];
    RequireSettable(adapter, known.capability, known.what);
    adapter.record.Set(known.path, enable);
  });
}

Adapter::iScsiStatus Adapter::SetUseDhcpv4(bool enable) {
  return Configure("SetUseDhcpv4", {enable}, Setting::Network, [&](host::Object& adapter) {
    RequireSettable(adapter, "IP Configuration Method Settable", "The IP configuration method");
    adapter.record.Set("network/useDhcpv4", enable);
  });
}

Adapter::iScsiStatus Adapter::SetIpVersionEnabled(int version, bool enable) {
  return Configure("SetIpVersionEnabled", {version, enable}, Setting::Network, [&](host::Object& adapter) {
    if (version == 4) {
      RequireSettable(adapter, "IPv4 Enable Settable", "Use of IPv4");
    } else if (version == 6) {
      RequireIpv6(adapter);
      RequireSettable(adapter, "IPv6 Enable Settable", "Use of IPv6");
    } else {
      Deny(Why::Invalid, "There is no IP version " + std::to_string(version) + ".");
    }
    adapter.record.Set(version == 4 ? "network/ipv4Enabled" : "network/ipv6Enabled", enable);
  });
}

Adapter::iScsiStatus Adapter::SetArpRedirect(bool enable) {
  return Configure("SetArpRedirect", {enable}, Setting::ArpRedirect, [&](host::Object& adapter) {
    RequireSettable(adapter, "ARP Redirect Settable", "The ARP redirect setting");
    adapter.record.Set("network/arpRedirect", enable);
  });
}

bool Adapter::GetArpRedirect() {
  return ref_.Read("GetArpRedirect", [](host::Tree&, const host::Object& adapter) {
    return adapter.record.GetBool("network/arpRedirect");
  });
}

Adapter::iScsiStatus Adapter::SetMtu(int mtu) {
  return Configure("SetMtu", {mtu}, Setting::Mtu, [&](host::Object& adapter) {
    RequireSettable(adapter, "MTU Settable", "The MTU");
    const int min = adapter.record.GetInt("network/mtuMin");
    const int max = adapter.record.GetInt("network/mtuMax");
    if (mtu < min || mtu > max) {
      Deny(Why::OutOfRange, "The MTU " + std::to_string(mtu) + " is not from " + std::to_string(min) +
                                " to " + std::to_string(max) + ".");
    }
    adapter.record.Set("network/mtu", mtu);
  });
}

int Adapter::GetMtu() {
  return ref_.Read("GetMtu", [](host::Tree&, const host::Object& adapter) {
    return adapter.record.GetInt("network/mtu");
  });
}

}  // namespace corectl
