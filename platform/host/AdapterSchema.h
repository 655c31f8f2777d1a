/// The keys of an adapter itself; those of what is below it are in its neighbours.
#pragma once

#include <array>

#include "host/LevelSchema.h"
#include "host/NetworkSchema.h"

namespace host {

// What is wrong with a whole record: see KindSpec.
std::string AdapterFault(const Record& adapter);
std::string SendTargetFault(const Record& place, const Record& adapter);
std::string StaticTargetFault(const Record& place, const Record& adapter);
std::string NetworkPortalFault(const Record& portal, const Record& adapter);
std::string LogicalPortalFault(const Record& portal, const Record& adapter);

constexpr Key Extended(std::string_view name, std::string_view help) {
  return Word(name, help, kExtendedBools).Default("unknown");
}

inline constexpr Key kPropertyKeys[] = {
    Text("vendor", "Vendor."),
    Text("model", "Model."),
    Text("description", "Description."),
    Text("serialNumber", "Serial Number."),
    Text("hardwareVersion", "Hardware Version."),
    Text("asicVersion", "Asic Version."),
    Text("firmwareVersion", "Firmware Version."),
    Text("optionRomVersion", "Option Rom Version."),
    Text("driverName", "Driver Name, as the hardware properties tell it."),
    Text("driverVersion", "Driver Version."),
    Boolean("tcpProtocolSupported", "TCP Protocol Supported."),
    Extended("bidirectionalTransfersSupported", "Bidirectional Transfers Supported."),
    Integer("maximumCdbLength", "Maximum Cdb Length in bytes."),
    Extended("canBeNic", "Can Be NIC."),
    Extended("isNic", "Is NIC."),
    Extended("isInitiator", "Is Initiator."),
    Extended("isTarget", "Is Target."),
    Extended("usingTcpOffloadEngine", "Using TCP Offload Engine."),
    Extended("usingIscsiOffloadEngine", "Using ISCSI Offload Engine."),
};

inline constexpr auto kCapabilityKeys = [] {
  std::array<Key, std::size(kCapabilities)> keys{};
  for (std::size_t i = 0; i < keys.size(); ++i)
    keys[i] = Boolean(kCapabilities[i], "The capability of this name.");
  return keys;
}();

/// What an operation with an iScsiStatus sets.
inline constexpr Key kSettingKeys[] = {
    Text("initiatorName", "The iSCSI name; empty for none.", IscsiNameOrNoneFault),
    Text("alias", "The iSCSI alias."),
    Nested("parameters", "The session parameters.", kAdapterParameterKeys),
    Nested("network", "Its network configuration.", kNetworkKeys),
    Nested("isns", "PollInterval of the adapter.", kIsnsParmKeys),
};
inline constexpr auto kPendingKeys = PendingKeys(kSettingKeys);

inline constexpr Key kAdapterKeys[] = {
    Text("name", "The name, unique on the host.").Required(),
    Word("kind", "scsi is an adapter without iSCSI.", kAdapterKinds),
    Text("uid", "The unique identifier."),
    Text("driver", "The driver's name."),
    Integer("state", "0 online, 1 offline, 2 unbound; other numbers are shown as unknown."),
    kSettingKeys[0],
    kSettingKeys[1],
    Nested("properties", "What the adapter is made of.", kPropertyKeys),
    Nested("capabilities", "What it can do.", kCapabilityKeys),
    kSettingKeys[2],
    Nested("chap", "The CHAP entries.", kChapKeys),
    Integer("discoveryStatus",
            "How the last discovery ended: 0 completed, 1 timeout, 2 completed with failed logins; other "
            "numbers are shown as unknown."),
    Text("physicalAdapter",
         "Adapters with the same text stand on one physical adapter; without it, on its own."),
    Nested("download", "How its physical adapter takes images; the first adapter on it counts.",
           kDownloadKeys),
    kSettingKeys[3],
    kSettingKeys[4],
    Text("nameFile",
         "Which writing of the file with the software initiator's name has had its turn; a later one holds "
         "from "
         "the next start on.")
        .Optional(),
    Text("plugin", "The file name of the management plug-in that serves it; empty for the first."),
    Nested("applies", "When changes of its settings take effect.", kEffectKeys),
    PendingKey(kPendingKeys),
};

inline constexpr Collection kAdapterCollections[] = {
    {"sendTargets", Kind::SendTarget, "The portals that it asks for targets, in the order of listings."},
    {"staticTargets", Kind::StaticTarget,
     "The target portals that it knows, in the order of listings. Those with a sendTarget are static targets "
     "only where they say so."},
    {"targets", Kind::Target, "The targets that it knows, in the order of listings."},
    {"routes", Kind::Route, "Its routes, in the order of listings."},
    {"networkPortals", Kind::NetworkPortal, "The host NICs that are bound to it, in the order of listings."},
    {"logicalPortals", Kind::LogicalPortal,
     "The logical portals of an independent adapter. Those of the others are the NICs that are bound."},
    {"physicalPortals", Kind::PhysicalPortal, "Its physical portals, in the order of listings."},
    {"isnsServers", Kind::IsnsServer, "Its iSNS servers, in the order of listings."},
};

}  // namespace host
