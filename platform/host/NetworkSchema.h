/// The keys of the network side: host NICs, the portals of adapters, their network configuration, iSNS
/// servers and the boot tables of the host.
#pragma once

#include "host/Formats.h"
#include "host/TargetSchema.h"

namespace host {

// Each says what is wrong with a text; empty when nothing is.
std::string MacOrNoneFault(std::string_view text);
std::string CanonicalHostOrNoneFault(std::string_view text);
std::string IpOrNoneFault(std::string_view text);
std::string LunFault(std::string_view text);
std::string IsnsServerFault(const Record& server);
std::string NicFault(const Record& nic);
/// The same of the list of IPv6 addresses at @p path, its keys with dots between.
std::string AddressListFault(const Record& record, const std::string& path);

constexpr Key Mac(std::string_view name) {
  return Text(name, "The MAC address; empty for none.", MacOrNoneFault);
}
constexpr Key Ipv4(std::string_view name, std::string_view help) {
  return Text(name, help, Ipv4Fault).Default("0.0.0.0");
}

inline constexpr Key kIpv6NetworkKeys[] = {
    Text("address", "The address.", Ipv6Fault).Required(),
    Integer("prefixLength", "The length of its prefix in bits.", 0, 128).Default(64),
    Integer("type",
            "0 static, 7 from a router advertisement, 9 from DHCP; other numbers are shown as unknown."),
};
inline constexpr Key kIpv6Network[] = {Nested("", "", kIpv6NetworkKeys)};

inline constexpr Key kNicKeys[] = {
    Text("name", "The name, unique on the host.").Required(),
    Text("deviceName", "The library's own name of it."),
    Mac("mac"),
    Ipv4("ipv4Address", "Its IPv4 address; 0.0.0.0 for none."),
    Ipv4("ipv4Netmask", "The mask of that address."),
    List("ipv6Addresses", "Its IPv6 addresses, in the order of listings.", kIpv6Network),
    Unsigned32("mtu", "MTU in bytes.").Default(1500),
    Boolean("vlanSupported", "Vlan Supported."),
    Unsigned32("vlanId", "Vlan ID."),
    Unsigned32("reservedPortFirst", "The first of its reserved ports."),
    Unsigned32("reservedPortCount", "How many ports are reserved."),
    Boolean("toe", "TCP offload engine."),
    Boolean("tso", "TCP segmentation offload."),
    Boolean("tcpChecksum", "TCP checksum offload."),
    Boolean("linkUp", "Link Up.", true),
    Unsigned32("currentSpeed", "Current speed in Mb/s."),
    Unsigned32("rxPackets", "Packets received."),
    Unsigned32("txPackets", "Packets sent."),
    Text("driver", "NIC Driver."),
    Text("driverVersion", "NIC Driver Version."),
    Text("firmwareVersion", "NIC Firmware Version."),
    Integer("complianceCode", "0 when it may serve as a network portal, any other number when not."),
    Text("nonCompliantMessage", "Why it may not."),
    Text("nonCompliantRemedy", "What to do about it."),
    Text("vswitch", "Vswitch."),
    Text("portGroup", "PortGroup."),
    Text("vswitchUuid", "VswitchUuid."),
    Text("portGroupKey", "PortGroupKey."),
    Text("portKey", "PortKey."),
    Text("duplex", "Duplex."),
};

inline constexpr Key kNetworkPortalKeys[] = {
    Text("nic", "The name of the host NIC that is bound.").Required(),
    Integer("pathStatus",
            "Shown as its path status in place of what follows from the sessions: 0 unused, 1 standby, 2 "
            "active, 3 last path; with the last two, it counts as used. Other numbers are shown as unknown.")
        .Optional(),
};

inline constexpr Key kLogicalPortalKeys[] = {
    Text("name", "The name.").Required(),
    Mac("mac"),
    Integer("complianceCode", "0 when it may serve as a network portal, any other number when not."),
};

inline constexpr Key kPhysicalPortalKeys[] = {
    Text("name", "The name.").Required(),
    Mac("mac"),
    Unsigned32("currentSpeed", "Current speed in Mb/s."),
    Unsigned32("maxSpeed", "Maximum speed in Mb/s."),
    Unsigned32("maxFrameSize", "Maximum frame size in bytes.").Default(1500),
};

inline constexpr Key kNetworkKeys[] = {
    Boolean("nicPropertiesSupported", "It can tell the properties of NICs.", true),
    Boolean("logicalPortalsSupported", "It can list its logical portals.", true),
    Boolean("ipv4Enabled", "IPv4 is on.", true),
    Boolean("useDhcpv4", "The IPv4 configuration comes from DHCP."),
    Ipv4("ipv4Address", "The IPv4 address; 0.0.0.0 for none."),
    Ipv4("ipv4Netmask", "The mask of that address."),
    Ipv4("gateway", "The IPv4 gateway; 0.0.0.0 for none."),
    Boolean("ipv6Enabled", "IPv6 is on."),
    Boolean("useDhcpv6", "IPv6 addresses come from DHCP."),
    Boolean("useRouterAdvertisement", "IPv6 addresses come from router advertisements."),
    Boolean("useLinkLocalAutoConfiguration", "The link-local address is made by the adapter."),
    Integer("ipv6PrefixLength", "The one prefix length that it takes; -1 for any.", -1, 128).Default(-1),
    Integer("ipv6MaxStaticAddresses",
            "The most routable static addresses that it takes; -1 for no stated limit.", -1)
        .Default(-1),
    List("ipv6Addresses", "Its IPv6 addresses, in the order of listings.", kIpv6Network),
    Text("gateway6", "The IPv6 gateway; :: for none.", Ipv6Fault).Default("::"),
    Text("domainName", "The library's own."),
    Text("primaryDns", "The primary DNS server; empty for none.", IpOrNoneFault),
    Text("secondaryDns", "The secondary DNS server; empty for none.", IpOrNoneFault),
    Integer("mtu", "MTU in bytes.", 0).Default(1500),
    Integer("mtuMin", "The least MTU that it takes.", 0).Default(576),
    Integer("mtuMax", "The greatest MTU that it takes.", 0).Default(9000),
    Boolean("arpRedirect", "It follows ARP redirects."),
};

/// PollInterval. As numbers, the four take any that fits: a command shows what the adapter says.
constexpr Key PollInterval(std::string_view name, std::string_view help, std::int64_t value) {
  return Integer(name, help).Default(value);
}
inline constexpr Key kIsnsParmKeys[] = {
    PollInterval("current", "PollInterval in seconds.", 30),
    PollInterval("default", "Its default.", 30),
    PollInterval("min", "The least that it can be set to.", 1),
    PollInterval("max", "The greatest that it can be set to.", 3600),
    Boolean("settable", "It can be set.", true),
    Boolean("valid", "The adapter has it at all.", true),
};

inline constexpr std::string_view kIsnsMethods[] = {"static", "dhcp", "slp"};

inline constexpr Key kIsnsServerKeys[] = {
    Word("method", "How the adapter learns of it.", kIsnsMethods),
    Text("address",
         "Its address or name, an IPv6 address as RFC 5952 writes it; empty unless the method is static.",
         CanonicalHostOrNoneFault)
        .Folded(),
    Boolean("inherited", "Its PollInterval is that of the adapter.", true),
    Nested("parms", "The parameters of this server.", kIsnsParmKeys),
};

inline constexpr std::string_view kBootTableNames[] = {"primary", "secondary"};

inline constexpr Key kBootTableKeys[] = {
    Word("table", "Which of the two it is.", kBootTableNames),
    Integer("enabled", "Other than 0: it holds."),
    Integer("nicFlags", "NIC Flags."),
    Integer("nicPciBusDevFunc", "Where the NIC is on the PCI bus."),
    Text("macAddress", "MAC Address."),
    Text("nicIP", "IP Address."),
    Text("nicSubnetMask", "Subnet Mask."),
    Text("nicGateway", "Gateway."),
    Integer("nicDhcp", "Other than 0: the address came from DHCP."),
    Integer("nicVlan", "Vlan."),
    Integer("targetBootFlags", "Target Boot Flags."),
    Text("targetIP", "Target IP."),
    Integer("targetPort", "Target Port.", 0, kUint16Most).Default(3260),
    Text("lun", "Lun, a number from 0 to 9223372036854775807.", LunFault).Default("0"),
    Text("targetName", "Target Name."),
    Integer("chapType", "0 none, 1 CHAP, 2 mutual CHAP."),
    Text("chapName", "Chap Name."),
    Text("chapPwd", "The CHAP secret.").Secret(),
    Text("reverseChapName", "Mutual Chap Name."),
    Text("reverseChapPwd", "The mutual CHAP secret.").Secret(),
    Integer("initiatorBootFlags", "Initiator Boot Flags."),
    Text("slpIP", "SLP Server IP."),
    Text("initiatorName", "Initiator Name."),
    Text("initiatorAlias", "Initiator Alias."),
};

inline constexpr std::string_view kNetworkPortalName[] = {"nic"};
inline constexpr std::string_view kIsnsServerName[] = {"method", "address"};
inline constexpr std::string_view kBootTableName[] = {"table"};

}  // namespace host
