#include "host/Schema.h"

#include <array>
#include <stdexcept>
#include <vector>

#include "host/Formats.h"
#include "host/LevelSchema.h"
#include "host/NetworkSchema.h"
#include "host/Operations.h"
#include "host/Pending.h"
#include "host/RemoteSchema.h"
#include "host/Storage.h"
#include "host/TargetSchema.h"

namespace host {

namespace {

constexpr std::string_view kNameKey[] = {"name"};

// ---- the host

constexpr Key kSoftwareKeys[] = {
    Boolean("enabled", "The software initiator is switched on.", true),
    Boolean("rebootPending", "It was switched off, and works on until the next reboot."),
};

constexpr Key kHostKeys[] = {
    Nested("softwareIscsi",
           "The software initiator. Adapters of the kind software are on the host only while it works.",
           kSoftwareKeys),
};

constexpr Collection kHostCollections[] = {
    {"adapters", Kind::Adapter, "The storage adapters, in the order of listings."},
    {"plugins", Kind::Plugin, "The plug-ins of the management API, in the order of listings."},
    {"nics", Kind::Nic, "The NICs that adapters can be bound to, in the order of the description."},
    {"bootTables", Kind::BootTable, "The boot tables of the firmware."},
    {"remotePortals", Kind::RemotePortal,
     "Portals of the network that do more than answer for the targets behind them."},
    {"remoteTargets", Kind::RemoteTarget,
     "The targets on the network, in the order in which their portals tell of them."},
    {"answers", Kind::Answer, "Operations that answer in another way than by doing their work."},
};

// ---- answers

constexpr Key kAnswerKeys[] = {
    Text("operation", "The name of the operation.").Required(),
    Text("adapter", "The adapter that it concerns; without it, every one.").Optional(),
    Integer("call", "The call that is answered, from 1, counted in each process; without it, every call.", 1)
        .Optional(),
    Word("throw", "Throws this instead of working.", kThrown).Optional(),
    Text("text", "The text of what is thrown.").Optional(),
    Integer("status", "The iScsiStatus: the work is done, and this returned; with 4 it is not done.")
        .Optional(),
    Integer("imaStatus", "The status of an IMA call; other than 0, the work is not done.", 0, kUint32Most)
        .Optional(),
};

std::string AnswerFault(const Record& answer) {
  const std::string& name = answer.GetString("operation");
  const OperationSpec* operation = FindOperation(name);
  if (operation == nullptr) {
    std::vector<std::string_view> names;
    for (const OperationSpec& one : kOperations) names.push_back(one.name);
    const std::string nearest = Nearest(name, names);
    return "operation: no operation is called " + Excerpt(name) +
           (nearest.empty() ? "" : "; did you mean " + Quoted(nearest) + "?");
  }
  const int given = answer.Has("throw") + answer.Has("status") + answer.Has("imaStatus");
  if (given != 1) return "expected exactly one of \"throw\", \"status\" and \"imaStatus\"";
  if (answer.Has("text") && !answer.Has("throw")) return "text: goes with \"throw\" only";
  if (answer.Has("imaStatus") != (operation->gives == Gives::Ima)) {
    return operation->gives == Gives::Ima ? name + " can be answered by an \"imaStatus\" only"
                                          : "imaStatus: " + name + " is no IMA call";
  }
  if (answer.Has("status") && operation->gives != Gives::Status)
    return "status: " + name + " gives no status";
  return {};
}

// ---- adapters

constexpr Key Extended(std::string_view name, std::string_view help) {
  return Word(name, help, kExtendedBools).Default("unknown");
}

constexpr Key kPropertyKeys[] = {
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

constexpr auto kCapabilityKeys = [] {
  std::array<Key, std::size(kCapabilities)> keys{};
  for (std::size_t i = 0; i < keys.size(); ++i)
    keys[i] = Boolean(kCapabilities[i], "The capability of this name.");
  return keys;
}();

/// What an operation with an iScsiStatus sets.
constexpr Key kSettingKeys[] = {
    Text("initiatorName", "The iSCSI name; empty for none.", IscsiNameOrNoneFault),
    Text("alias", "The iSCSI alias."),
    Nested("parameters", "The session parameters.", kAdapterParameterKeys),
    Nested("network", "Its network configuration.", kNetworkKeys),
    Nested("isns", "PollInterval of the adapter.", kIsnsParmKeys),
};
constexpr auto kPendingKeys = PendingKeys(kSettingKeys);

constexpr Key kAdapterKeys[] = {
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

std::string AdapterFault(const Record& adapter) {
  std::string fault = ParameterFault(adapter);
  if (fault.empty()) fault = AddressListFault(adapter, "network.ipv6Addresses");
  if (!fault.empty() || !adapter.Has("pending")) return fault;
  const Object object{.kind = Kind::Adapter, .name = {}, .record = adapter};
  try {
    Configured(object);
  } catch (const Error& error) {
    return std::string("pending: ") + error.what();
  }
  return {};
}

template <Kind kind>
std::string PlaceFault(const Record& place, const Record& adapter) {
  std::string fault = OverrideFault(place, adapter);
  if (!fault.empty() || !place.Has("pending")) return fault;
  const Object object{.kind = kind, .name = {}, .record = place};
  fault = OverrideFault(Configured(object).record, adapter);
  return fault.empty() ? "" : "pending: " + fault;
}

std::string NetworkPortalFault(const Record&, const Record& adapter) {
  const std::string& kind = adapter.GetString("kind");
  if (kind == "software" || kind == "dependent") return {};
  return "only a software or dependent adapter has NICs bound to it, and this one is of the kind " +
         Quoted(kind);
}

std::string LogicalPortalFault(const Record&, const Record& adapter) {
  const std::string& kind = adapter.GetString("kind");
  if (kind == "independent") return {};
  return "only an independent adapter has portals of its own, and this one is of the kind " + Quoted(kind);
}

constexpr Collection kAdapterCollections[] = {
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

constexpr KindSpec kKinds[] = {
    {Kind::Host, "host", kHostKeys, kHostCollections, {}},
    {Kind::Answer, "answer", kAnswerKeys, {}, {}, AnswerFault},
    {Kind::Adapter, "adapter", kAdapterKeys, kAdapterCollections, kNameKey, AdapterFault},
    {Kind::SendTarget,
     "sendtarget",
     kSendTargetKeys,
     {},
     kSendTargetName,
     nullptr,
     PlaceFault<Kind::SendTarget>},
    {Kind::StaticTarget,
     "static target",
     kStaticTargetKeys,
     {},
     kStaticTargetName,
     nullptr,
     PlaceFault<Kind::StaticTarget>},
    {Kind::Target, "target", kTargetKeys, kTargetCollections, kNameKey},
    {Kind::Session, "session", kSessionKeys, kSessionCollections, kSessionName},
    {Kind::Connection, "connection", kConnectionKeys, {}, kConnectionName},
    {Kind::Plugin, "plugin", kPluginKeys, {}, {}},
    {Kind::Route, "route", kRouteKeys, {}, {}},
    {Kind::Nic, "nic", kNicKeys, {}, kNameKey, NicFault},
    {Kind::NetworkPortal,
     "network portal",
     kNetworkPortalKeys,
     {},
     kNetworkPortalName,
     nullptr,
     NetworkPortalFault},
    {Kind::LogicalPortal, "logical portal", kLogicalPortalKeys, {}, kNameKey, nullptr, LogicalPortalFault},
    {Kind::PhysicalPortal, "physical portal", kPhysicalPortalKeys, {}, kNameKey},
    {Kind::IsnsServer, "iSNS server", kIsnsServerKeys, {}, kIsnsServerName, IsnsServerFault},
    {Kind::BootTable, "boot table", kBootTableKeys, {}, kBootTableName},
    {Kind::RemotePortal, "remote portal", kRemotePortalKeys, {}, kRemotePortalName},
    {Kind::RemoteTarget, "remote target", kRemoteTargetKeys, {}, kNameKey},
};

const bool isSet = [] {
  SetSchema(kKinds);
  return true;
}();

}  // namespace

}  // namespace host
