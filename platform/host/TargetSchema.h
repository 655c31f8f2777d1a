/// The keys of what is seen through the management API: targets, sessions, connections, plug-ins and routes.
#pragma once

#include "host/Schema.h"

namespace host {

inline constexpr std::int64_t kUint16Most = std::numeric_limits<std::uint16_t>::max();
inline constexpr std::int64_t kUint32Most = std::numeric_limits<std::uint32_t>::max();

// Each says what is wrong with a text; empty when nothing is.
std::string IpFault(std::string_view text);
std::string TargetNameFault(std::string_view text);
std::string IsidFault(std::string_view text);
std::string TimeFault(std::string_view text);
std::string InterfaceFault(std::string_view text);

constexpr Key Unsigned16(std::string_view name, std::string_view help) {
  return Integer(name, help, 0, kUint16Most);
}
constexpr Key Unsigned32(std::string_view name, std::string_view help) {
  return Integer(name, help, 0, kUint32Most);
}

inline constexpr Key kDownloadKeys[] = {
    Unsigned32("fileSupported", "1: it looks at image files, and takes them.").Default(1),
    Unsigned32("firmwareSupported", "1: it says that it takes firmware.").Default(1),
    Unsigned32("optionRomSupported", "1: it says that it takes an option ROM.").Default(1),
    Text("bootcodeVersion", "The version of the boot code that was downloaded last."),
};

inline constexpr std::string_view kDiscoveryMethods[] = {"static", "slp", "isns", "sendtargets"};
inline constexpr Key kDiscoveryMethod[] = {Word("", "", kDiscoveryMethods)};

inline constexpr Key kAddressKeys[] = {
    Text("address", "An IPv4 address, or an IPv6 address as RFC 5952 writes it.", IpFault).Required(),
    Unsigned32("portAndTagPresent", "1: port and tag mean something.").Default(1),
    Unsigned16("port", "The TCP port.").Default(3260),
    Unsigned16("tag", "The target portal group tag.").Default(1),
};
inline constexpr Key kAddress[] = {Nested("", "", kAddressKeys)};

inline constexpr Key kTargetKeys[] = {
    Text("name", "The iSCSI name, of at most 223 characters.", TargetNameFault).Required(),
    Text("alias", "The alias that the target tells of itself."),
    List("discoveryMethods", "How it was discovered.", kDiscoveryMethod),
    Boolean("sendTargetsDiscoverySettable", "SendTargets Discovery Settable."),
    Boolean("sendTargetsDiscoveryEnabled", "SendTargets Discovery Enabled."),
    List("addresses", "Where it answers.", kAddress),
    Unsigned32("loginStatus", "The status word of the last login; 0 for no error."),
};

inline constexpr Key kSessionKeys[] = {
    Text("isid", "The initiator's part of the session identifier, twelve hexadecimal digits in lower case.",
         IsidFault)
        .Required(),
    Text("portal",
         "The network portal that it goes over: the name of the host NIC that is bound, or of the adapter's "
         "own portal. Without it, it counts for each.")
        .Optional(),
    Unsigned16("tsih", "The target's part of the session identifier.").Default(1),
    Unsigned16("targetPortalGroupTag", "The portal group that it is with.").Default(1),
    Unsigned32("authMethod", "0 none, 1 CHAP; other numbers are shown as unsupported."),
    Boolean("dataPduInOrder", "DataPDUInOrder.", true),
    Boolean("dataSequenceInOrder", "DataSequenceInOrder.", true),
    Unsigned32("defaultTime2Retain", "DefaultTime2Retain in seconds.").Default(20),
    Unsigned32("defaultTime2Wait", "DefaultTime2Wait in seconds.").Default(2),
    Unsigned32("errorRecoveryLevel", "ErrorRecoveryLevel."),
    Unsigned32("firstBurstLength", "FirstBurstLength in bytes.").Default(65536),
    Boolean("immediateData", "ImmediateData.", true),
    Boolean("initialR2T", "InitialR2T.", true),
    Unsigned32("maxBurstLength", "MaxBurstLength in bytes.").Default(262144),
    Unsigned32("maxConnections", "MaxConnections.").Default(1),
    Unsigned32("maxOutstandingR2T", "MaxOutstandingR2T.").Default(1),
};

inline constexpr Key kConnectionKeys[] = {
    Unsigned16("cid", "The connection identifier.").Required(),
    Unsigned32("dataDigest", "0 none, 1 CRC32C; no other number exists."),
    Unsigned32("headerDigest", "0 none, 1 CRC32C; no other number exists."),
    Boolean("ifMarker", "IFMarker."),
    Unsigned32("ifMarkerInterval", "IFMarkInt."),
    Unsigned32("maxRecvDataSegmentLength", "What the initiator takes, in bytes.").Default(8192),
    Unsigned32("maxTransmitDataSegmentLength", "What the target takes, in bytes.").Default(8192),
    Boolean("ofMarker", "OFMarker."),
    Unsigned32("ofMarkerInterval", "OFMarkInt."),
    Text("connectionAddress", "The address that the connection was made to.", IpFault).Optional(),
    Text("remoteAddress", "The address that it talks to.", IpFault).Optional(),
    Text("localAddress", "The host's own address on it.", IpFault).Optional(),
    Unsigned32("state", "0 free to 7 cleanup_wait, as the management API counts; 4 is logged in.").Default(4),
    Text("sessionCreateTime", "When the session was made.", TimeFault).Optional(),
    Text("connectionCreateTime", "When the connection was made.", TimeFault).Optional(),
    Text("connectionStartTime", "When it began to carry commands.", TimeFault).Optional(),
};

inline constexpr Key kPluginKeys[] = {
    Text("fileName", "The file name.").Required(),
    Text("vendor", "Vendor."),
    Text("implementationVersion", "Implementation Version."),
    Unsigned32("supportedImaVersion", "Supported Ima Version.").Default(1),
    Text("buildTime", "When it was built.", TimeFault).Optional(),
    Unsigned32("lhbasCanBeCreatedAndDestroyed", "1: Lhbas Can Be Created And Destroyed."),
    Unsigned32("autoPersistenceSupported", "1: Auto Persistence Supported."),
};

inline constexpr Key kRouteKeys[] = {
    Text("destination", "The network that it leads to.", IpFault).Required(),
    Text("netmask", "The mask of that network.", IpFault).Required(),
    Text("gateway", "Where it leads through.", IpFault).Required(),
    Unsigned32("metric", "What it costs.").Default(1),
    Boolean("associated", "It is tied to a network portal.", true),
    Text("interface", "The name of the network portal, at most 32 bytes.", InterfaceFault),
};

inline constexpr Collection kTargetCollections[] = {
    {"sessions", Kind::Session, "The sessions with it, in the order of listings."},
};
inline constexpr Collection kSessionCollections[] = {
    {"connections", Kind::Connection, "Its connections, in the order of listings."},
};

inline constexpr std::string_view kSessionName[] = {"isid", "targetPortalGroupTag"};
inline constexpr std::string_view kConnectionName[] = {"cid"};

}  // namespace host
