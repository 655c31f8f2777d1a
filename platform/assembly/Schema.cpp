/// All kinds of objects of a host: the one table of them, made of the keys that the rooms below have.
#include "host/AdapterSchema.h"
#include "host/AnswerSchema.h"
#include "simulator/RemoteSchema.h"

namespace assembly {

using namespace host;
using namespace simulator;

namespace {

constexpr std::string_view kNameKey[] = {"name"};

constexpr Key kSoftwareKeys[] = {
    Boolean("enabled", "The software initiator is switched on.", true),
    Boolean("rebootPending", "It was switched off, and works on until the next reboot."),
};

constexpr Key kHostKeys[] = {
    Nested("softwareIscsi",
           "The software initiator. Adapters of the kind software are on the host only while it works.",
           kSoftwareKeys),
    Text("machine",
         "\"linux\" where the host is this machine\'s own initiator, as hcli linux adopt makes it.")
        .Optional(),
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

constexpr KindSpec kKinds[] = {
    {Kind::Host, "host", kHostKeys, kHostCollections, {}},
    {Kind::Answer, "answer", kAnswerKeys, {}, {}, AnswerFault},
    {Kind::Adapter, "adapter", kAdapterKeys, kAdapterCollections, kNameKey, AdapterFault},
    {Kind::SendTarget, "sendtarget", kSendTargetKeys, {}, kSendTargetName, nullptr, SendTargetFault},
    {Kind::StaticTarget,
     "static target",
     kStaticTargetKeys,
     {},
     kStaticTargetName,
     nullptr,
     StaticTargetFault},
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

}  // namespace assembly
