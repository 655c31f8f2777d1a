/// The records that pass between front ends and the storage control library, and their enumerations.
///
/// All are plain values with members in the order of the binary interface. Enumerations have a fixed
/// 32-bit representation and may hold numbers that they do not name: a newer library may know more.
///
/// Texts are UTF-8 and shown as they are; an empty one stands for none or unknown. Members called the
/// library's own are copied and passed back by front ends, which neither read nor show them.
#pragma once

#include <NodeCtl/Network.h>

#include <cstdint>
#include <string>
#include <utility>

namespace NodeCtl::Storage {

/// How strongly CHAP is asked for: done only without, rather without, rather with, and only with it. Front
/// ends cannot show another number, and fail. They set mutual CHAP to Prohibited or Required alone, and
/// to Required only over CHAP that is.
enum class iScsiChapType : std::int32_t { Prohibited = 1, Discouraged = 2, Preferred = 3, Required = 4 };

/// How strongly a digest (RFC 7143 section 13.1) is asked for, as with CHAP: "None" alone, "None,CRC32C",
/// "CRC32C,None" and "CRC32C" alone is offered. Front ends cannot show another number, and fail.
enum class iScsiDigestType : std::int32_t { Prohibited = 1, Discouraged = 2, Preferred = 3, Required = 4 };

/// A truth value that may be unknown: any number but 0 and 1.
enum class ExtendedBool : std::int32_t { False = 0, True = 1, Unknown = 2 };

/// How a network portal serves the sessions of its adapter: the adapter has none; none goes over this portal;
/// some do, and each of their targets has one over another portal too; a target has sessions over this portal
/// alone. Other numbers may occur and are shown as unknown.
enum class iScsiNetworkPortalStatus : std::int32_t { Unused = 0, Standby = 1, Active = 2, LastPath = 3 };

/// Whether a host NIC may serve as a network portal: 0 when it complies, any other number when not.
enum class iScsiPortErrorCodes : std::int32_t { Compliant = 0 };

/// The direction of a CHAP entry: the target authenticates the initiator, or the initiator the target.
enum iScsiChapDirection : int { ChapUni = 0, ChapMutual = 1 };

/// A numeric session parameter, with all members in its unit. The range is that of this adapter, within that
/// of the standard. Front ends read and write the low 32 bits as a signed number: they show a value above
/// 2147483647 as another one.
template <class Integer>
struct iScsiIntegerParm {
  Integer current = 0;       ///< the value at this level, the parent's where it is inherited
  Integer defaultValue = 0;  ///< the value that front ends set to go back to the default
  Integer min = 0;           ///< the least value that can be set
  Integer max = 0;           ///< the greatest value that can be set
  bool settable = false;     ///< it can be changed at this level
  /// False when the level has no such parameter; the other members then mean nothing.
  bool valid = false;
};

/// A session parameter that is on or off. Members mean what they do in iScsiIntegerParm.
struct iScsiBoolParm {
  bool current = false;
  bool defaultValue = false;
  bool settable = false;
  bool valid = false;
};

/// The session parameters of an adapter, a sendtarget or a target. Digests are not among them: they pass
/// by operations of their own. Ranges below are those of the standard; where none is given it is the
/// adapter's choice.
struct iScsiParms {
  iScsiIntegerParm<std::int32_t> errorRecoveryLevel;    ///< 0 to 2, RFC 7143 section 13.20
  iScsiIntegerParm<std::int32_t> initialLoginRetryMax;  ///< attempts at a login
  iScsiBoolParm initialR2T;                             ///< RFC 7143 section 13.10
  iScsiIntegerParm<std::int32_t> maxOutstandingR2T;     ///< 1 to 65535, RFC 7143 section 13.17
  iScsiIntegerParm<std::int64_t> firstBurstLength;      ///< bytes, 512 to 16777215, RFC 7143 section 13.14
  iScsiIntegerParm<std::int64_t> maxBurstLength;        ///< bytes, 512 to 16777215, RFC 7143 section 13.13
  iScsiIntegerParm<std::int64_t> maxRecvDataSegment;    ///< bytes, 512 to 16777215, RFC 7143 section 13.12
  iScsiIntegerParm<std::int32_t> maxCmds;               ///< commands outstanding in a session
  iScsiBoolParm immediateData;                          ///< RFC 7143 section 13.11
  iScsiIntegerParm<std::int32_t> defaultTime2Wait;      ///< seconds, 0 to 3600, RFC 7143 section 13.15
  iScsiIntegerParm<std::int32_t> defaultTime2Retain;    ///< seconds, 0 to 3600, RFC 7143 section 13.16
  iScsiIntegerParm<std::int32_t> loginTimeout;          ///< seconds for one login
  iScsiIntegerParm<std::int32_t> logoutTimeout;         ///< seconds for one logout
  iScsiIntegerParm<std::int32_t> noopOutInterval;       ///< seconds between NOP-Outs (RFC 7143 section 11.18)
  iScsiIntegerParm<std::int32_t> noopOutTimeout;        ///< seconds to wait for the NOP-In that answers
  iScsiIntegerParm<std::int32_t> recoveryTimeout;       ///< seconds to wait for a lost session to come back
  iScsiBoolParm delayedAck;                             ///< TCP delayed acknowledgement
  std::string parent;          ///< the level that this one inherits from, as the library names it; shown
  bool chapInherited = false;  ///< the CHAP entry comes from the parent
  bool mutualChapInherited = false;  ///< the mutual CHAP entry comes from the parent
  // One mark for each parameter: set, its value comes from the parent.
  bool headerDigestInherited = false;
  bool dataDigestInherited = false;
  bool maxOutstandingR2TInherited = false;
  bool firstBurstLengthInherited = false;
  bool maxBurstLengthInherited = false;
  bool maxRecvDataSegmentInherited = false;
  bool errorRecoveryLevelInherited = false;
  bool initialLoginRetryMaxInherited = false;
  bool initialR2TInherited = false;
  bool maxCmdsInherited = false;
  bool immediateDataInherited = false;
  bool defaultTime2WaitInherited = false;
  bool defaultTime2RetainInherited = false;
  bool loginTimeoutInherited = false;
  bool logoutTimeoutInherited = false;
  bool noopOutIntervalInherited = false;
  bool noopOutTimeoutInherited = false;
  bool recoveryTimeoutInherited = false;
  bool delayedAckInherited = false;
};

/// The one parameter of iSNS discovery, PollInterval, in seconds. Members mean what they do in
/// iScsiIntegerParm; none is negative.
struct iSnsParms {
  std::int32_t current = 0;
  std::int32_t defaultValue = 0;
  std::int32_t min = 0;
  std::int32_t max = 0;
  bool settable = false;
  bool valid = false;
  std::string parent;      ///< the level that this one inherits from, as the library names it; not shown
  bool inherited = false;  ///< the value comes from the parent
};

/// A CHAP entry (RFC 1994): with which name and secret the side that proves itself does so. A library that
/// reads one out need not fill in the secret.
struct iScsiChapParameters {
  std::int32_t algorithm = 0;     ///< the library's own; passed on unchanged
  std::string name;               ///< the CHAP name, at most 255 bytes (RFC 7143 section 6.1)
  std::int32_t secretType = 0;    ///< the library's own; passed on unchanged
  std::int32_t secretLength = 0;  ///< the library's own; passed on unchanged
  std::string secret;             ///< never shown; at most 255 bytes
  iScsiChapType level = iScsiChapType::Prohibited;
};

/// A portal of a target: an address or a name, and a TCP port from 0 to 65535. The default port of iSCSI is
/// 3260 (RFC 7143 section 13.8). Two are the same where host and port are; a name is not resolved for that.
struct TargetAddress {
  TargetAddress() = default;
  TargetAddress(Network::HostAddress hostAddress, std::uint16_t portNumber)
      : host(std::move(hostAddress)), port(portNumber) {}

  Network::HostAddress host;
  std::uint16_t port = 3260;
};

/// A target by name and portal: the key of a target throughout the library. Two are the same where name and
/// address are, whatever the three numbers.
struct StaticTarget {
  StaticTarget() = default;
  StaticTarget(std::string targetName, TargetAddress targetAddress)
      : name(std::move(targetName)), address(std::move(targetAddress)) {}

  std::string name;  ///< iSCSI name (RFC 7143 section 4.2.7), at most 223 bytes
  TargetAddress address;
  std::int32_t portalGroup = 0;  ///< the library's own; 0 in a key
  std::int32_t flags = 0;        ///< the library's own; 0 in a key
  std::int32_t origin = 4;       ///< the library's own; 4 in a key
};

/// How an adapter learns of an iSNS server: it was told, by DHCP (RFC 4174) or by SLP (RFC 4018). Front ends
/// cannot show another number, and fail.
enum class iSnsDiscoveryMethod : std::int32_t { Static = 0, Dhcp = 1, Slp = 2 };

/// An iSNS server (RFC 4171) of an adapter.
struct iSnsConfig {
  iSnsDiscoveryMethod method = iSnsDiscoveryMethod::Dhcp;
  Network::HostAddress address;  ///< an address or a name for the static method; no host for the others
};

/// What an adapter is made of: the properties of a physical HBA in the iSCSI Management API.
struct iScsiPhysicalHbaProperties {
  std::string vendor;
  std::string model;
  std::string description;
  std::string serialNumber;
  std::string hardwareVersion;
  std::string asicVersion;
  std::string firmwareVersion;
  std::string optionRomVersion;
  std::string driverName;
  std::string driverVersion;
  bool tcpProtocolSupported = false;
  ExtendedBool bidirectionalTransfersSupported = ExtendedBool::Unknown;
  std::int32_t maximumCdbLength = 0;  ///< bytes; 0 where unknown
  ExtendedBool canBeNic = ExtendedBool::Unknown;
  ExtendedBool isNic = ExtendedBool::Unknown;
  ExtendedBool isInitiator = ExtendedBool::Unknown;
  ExtendedBool isTarget = ExtendedBool::Unknown;
  ExtendedBool usingTcpOffloadEngine = ExtendedBool::Unknown;
  ExtendedBool usingIscsiOffloadEngine = ExtendedBool::Unknown;
};

/// What an adapter can do, and which of its settings can be changed. Beside each stands what works only where
/// it is true, and is refused elsewhere; CHAP and digests can always be set to Prohibited.
struct iScsiCapabilities {
  bool iSnsSettable = false;                              ///< AddIsnsConfig, RemoveIsnsConfig
  bool slpSettable = false;                               ///< shown only
  bool staticDiscoverySettable = false;                   ///< AddStaticTarget
  bool sendTargetDiscoverySettable = false;               ///< AddSendTargetAddress
  bool authorizationMethodSettable = false;               ///< shown only
  bool chapAuthorizationSupported = false;                ///< CHAP at the adapter (RFC 7143 section 12.1.3)
  bool srpAuthorizationSupported = false;                 ///< SRP (RFC 7143 section 12.1.2); shown only
  bool krb5AuthorizationSupported = false;                ///< Kerberos (RFC 7143 section 12.1.1); shown only
  bool spkm1AuthorizationSupported = false;               ///< SPKM-1 (RFC 3720 section 11.1.2); shown only
  bool spkm2AuthorizationSupported = false;               ///< SPKM-2 (RFC 3720 section 11.1.2); shown only
  bool mutualAuthenticationSupported = false;             ///< mutual CHAP at the adapter
  bool targetLevelAuthenticationSupported = false;        ///< CHAP at sendtargets and target portals
  bool targetLevelMutualAuthenticationSupported = false;  ///< mutual CHAP at sendtargets and target portals
  bool adapterHeaderDigestSupported = false;              ///< SetHeaderDigest
  bool targetLevelHeaderDigestSupported = false;     ///< SetTargetHeaderDigest, SetSendTargetHeaderDigest
  bool adapterDataDigestSupported = false;           ///< SetDataDigest
  bool targetLevelDataDigestSupported = false;       ///< SetTargetDataDigest, SetSendTargetDataDigest
  bool arpRedirectSettable = false;                  ///< SetArpRedirect
  bool mtuSettable = false;                          ///< SetMtu
  bool delayedAckSettable = false;                   ///< iScsiParms::delayedAck
  bool ipv6Supported = false;                        ///< IPv6 addresses anywhere, and all IPv6 settings
  bool dnsBasedAddressSupported = false;             ///< host names as addresses of targets
  bool inheritanceSupported = false;                 ///< shown only
  bool ipv4EnableSettable = false;                   ///< SetIpVersionEnabled of 4
  bool ipConfigurationMethodSettable = false;        ///< SetUseDhcpv4
  bool subnetMaskSettable = false;                   ///< SetIpv4SubnetMask
  bool defaultGatewaySettable = false;               ///< SetIpv4Gateway
  bool ipv6EnableSettable = false;                   ///< SetIpVersionEnabled of 6
  bool ipv6PrefixLengthSettable = false;             ///< shown only
  bool ipv6DhcpConfigurationMethodSettable = false;  ///< SetIpv6ConfigMethod of Dhcpv6
  /// SetIpv6ConfigMethod of LinkLocalAutoConfiguration
  bool ipv6LinkLocalAutoConfigurationMethodSettable = false;
  /// SetIpv6ConfigMethod of RouterAdvertisement
  bool ipv6RouterAdvertisementConfigurationMethodSettable = false;
  bool ipv6DefaultGatewaySettable = false;  ///< SetIpv6Gateway
  bool primaryDnsSettable = false;          ///< SetDnsServers, the primary one
  bool secondaryDnsSettable = false;        ///< SetDnsServers, the secondary one
  bool nameAndAliasSettable = false;        ///< SetInitiatorName, SetInitiatorAlias
};

/// A logical network portal: a host NIC as its adapter sees it.
struct iScsiLnpProperties {
  Network::MacAddress mac;  ///< not valid where unknown
  std::string name;         ///< unique on the adapter; that of the host NIC where one is bound
};

/// A physical network portal.
struct iScsiPnpProperties {
  Network::MacAddress mac;         ///< not valid where unknown
  std::uint32_t currentSpeed = 0;  ///< Mb/s; 0 without a link
  std::uint32_t maxSpeed = 0;      ///< Mb/s
  std::uint32_t maxFrameSize = 0;  ///< bytes
  std::string name;                ///< unique on the adapter
};

/// A host NIC that is bound to an adapter as a network portal.
struct iScsiNicProperties {
  std::string name;            ///< unique on the host; as BindHostnic takes it
  std::string deviceName;      ///< the library's own name of the NIC
  Network::MacAddress mac;     ///< not valid where unknown
  Network::IpConfig ipConfig;  ///< addresses and netmask
  std::uint32_t mtu = 0;       ///< bytes
  bool vlanSupported = false;
  std::uint32_t vlanId = 0;             ///< 1 to 4094 (IEEE 802.1Q); 0 for no VLAN
  std::uint32_t reservedPortFirst = 0;  ///< the first of the TCP ports kept for the adapter, 0 to 65535
  std::uint32_t reservedPortCount = 0;  ///< how many, from that one on; 0 for none
  bool toe = false;                     ///< TCP offload engine
  bool tso = false;                     ///< TCP segmentation offload
  bool tcpChecksum = false;             ///< TCP checksum offload
  bool linkUp = false;
  std::uint32_t currentSpeed = 0;  ///< Mb/s; 0 without a link
  std::uint32_t rxPackets = 0;     ///< received since the NIC came up, modulo 2^32
  std::uint32_t txPackets = 0;     ///< sent since then, modulo 2^32
  std::string driver;              ///< its name
  std::string driverVersion;
  std::string firmwareVersion;
  iScsiPortErrorCodes complianceCode = iScsiPortErrorCodes::Compliant;
  std::string nonCompliantMessage;  ///< why the NIC does not comply, in the library's words; empty if it does
  std::string nonCompliantRemedy;   ///< what to do about it, in the library's words; empty if it does
  std::string vswitch;              ///< the name of the virtual switch; empty where the NIC is on none
  std::string portGroup;            ///< the name of the port group on it
  std::string vswitchUuid;          ///< the UUID of the switch, in the library's form
  std::string portGroupKey;         ///< the key of the port group, in the library's form
  std::string portKey;              ///< the key of the port on the switch, in the library's form
  std::string duplex;               ///< "full" or "half"; empty where unknown
  iScsiNetworkPortalStatus pathStatus = iScsiNetworkPortalStatus::Unused;
};

/// The network configuration of an adapter. Front ends read support, switches and limits, and refuse by them
/// before they call a setter.
struct iScsiNetworkProperties {
  bool ipv4Enabled = false;
  Network::IpConfig ipConfig;  ///< IPv4 address and netmask, and all IPv6 networks
  bool useDhcpv4 = false;
  Network::Ipv4Address gateway;  ///< 0.0.0.0 for none
  bool ipv6Supported = false;    ///< as in iScsiCapabilities
  bool ipv6Enabled = false;
  bool useDhcpv6 = false;
  bool useRouterAdvertisement = false;
  bool useLinkLocalAutoConfiguration = false;
  std::int32_t ipv6PrefixLength = -1;  ///< the one prefix length that it takes, 0 to 128 bits; -1 for any
  std::int32_t ipv6MaxStaticAddresses = -1;  ///< of routable ones, 0 or more; -1 for no stated limit
  Network::Ipv6Address gateway6;             ///< :: for none
  std::string domainName;                    ///< the library's own
  std::string primaryDns;                    ///< an IPv4 or IPv6 address; empty for none
  std::string secondaryDns;                  ///< an IPv4 or IPv6 address; empty for none
};

}  // namespace NodeCtl::Storage
