// The portals of adapters: host NICs that are bound, logical and physical ones.

#include "corectl/Adapter.h"
#include "corectl/Members.h"
#include "corectl/NetworkText.h"
#include "host/Formats.h"
#include "host/NetworkSchema.h"
#include "host/Paths.h"
#include "host/Sessions.h"

namespace corectl {

namespace {

using host::Kind;
using host::Quoted;

constexpr Member<iScsiNicProperties> kNicMembers[] = {
    {"deviceName", &iScsiNicProperties::deviceName},
    {"mtu", &iScsiNicProperties::mtu},
    {"vlanSupported", &iScsiNicProperties::vlanSupported},
    {"vlanId", &iScsiNicProperties::vlanId},
    {"reservedPortFirst", &iScsiNicProperties::reservedPortFirst},
    {"reservedPortCount", &iScsiNicProperties::reservedPortCount},
    {"toe", &iScsiNicProperties::toe},
    {"tso", &iScsiNicProperties::tso},
    {"tcpChecksum", &iScsiNicProperties::tcpChecksum},
    {"linkUp", &iScsiNicProperties::linkUp},
    {"currentSpeed", &iScsiNicProperties::currentSpeed},
    {"rxPackets", &iScsiNicProperties::rxPackets},
    {"txPackets", &iScsiNicProperties::txPackets},
    {"driver", &iScsiNicProperties::driver},
    {"driverVersion", &iScsiNicProperties::driverVersion},
    {"firmwareVersion", &iScsiNicProperties::firmwareVersion},
    {"nonCompliantMessage", &iScsiNicProperties::nonCompliantMessage},
    {"nonCompliantRemedy", &iScsiNicProperties::nonCompliantRemedy},
    {"vswitch", &iScsiNicProperties::vswitch},
    {"portGroup", &iScsiNicProperties::portGroup},
    {"vswitchUuid", &iScsiNicProperties::vswitchUuid},
    {"portGroupKey", &iScsiNicProperties::portGroupKey},
    {"portKey", &iScsiNicProperties::portKey},
    {"duplex", &iScsiNicProperties::duplex},
};

constexpr Member<iScsiPnpProperties> kPhysicalMembers[] = {
    {"name", &iScsiPnpProperties::name},
    {"currentSpeed", &iScsiPnpProperties::currentSpeed},
    {"maxSpeed", &iScsiPnpProperties::maxSpeed},
    {"maxFrameSize", &iScsiPnpProperties::maxFrameSize},
};

/// Refuses as an adapter without the call @p call does.
void RequireCall(const host::Object& adapter, const char* supported, const char* call) {
  if (adapter.record.GetBool(supported)) return;
  Deny(Why::NotSupported,
       std::string("iScsiLibException: status(80000001): Not supported; Message= ") + call);
}
void RequireNicProperties(const host::Object& adapter) {
  RequireCall(adapter, "network/nicPropertiesSupported", "IMA_TSR_GetNicProperties");
}

iScsiPortErrorCodes ComplianceOf(const host::Record& record) {
  return static_cast<iScsiPortErrorCodes>(record.GetInt("complianceCode"));
}

/// What the host knows of its NIC @p name; of one that it does not have, only the name.
iScsiNicProperties NicOf(host::Tree& tree, const std::string& name) {
  iScsiNicProperties nic;
  nic.name = name;
  const auto found = tree.Find(host::kRoot, Kind::Nic, name);
  if (!found) return nic;
  Fill(nic, kNicMembers, found->record);
  nic.mac = MacAt(found->record, "mac");
  nic.ipConfig = IpConfigAt(found->record, "");
  nic.complianceCode = ComplianceOf(found->record);
  return nic;
}

}  // namespace

/// The NICs that are bound to @p adapter.
static std::vector<iScsiNicProperties> BoundNics(host::Tree& tree, const host::Object& adapter) {
  RequireNicProperties(adapter);
  const std::vector<host::Object> portals = tree.Children(adapter.id, Kind::NetworkPortal);
  const std::vector<int> statuses = host::PathStatuses(tree, adapter, portals);
  std::vector<iScsiNicProperties> nics;
  for (std::size_t i = 0; i < portals.size(); ++i) {
    nics.push_back(NicOf(tree, portals[i].name));
    nics.back().pathStatus = static_cast<iScsiNetworkPortalStatus>(statuses[i]);
  }
  return nics;
}

void Adapter::GetNicProperties(iScsiNicProperties& nic, std::vector<iScsiNicProperties>& nics) {
  const std::string name = nic.name;
  iScsiNicProperties known =
      ref_.Read("GetNicProperties", {name}, [&](host::Tree& tree, const host::Object& adapter) {
        RequireNicProperties(adapter);
        if (tree.Find(host::kRoot, Kind::Nic, name)) return NicOf(tree, name);
        const auto portal = tree.Find(adapter.id, Kind::LogicalPortal, name);
        if (!portal)
          Deny(Why::NotFound,
               "The adapter " + Quoted(adapter.name) + " does not know the NIC " + Quoted(name) + ".");
        iScsiNicProperties properties;
        properties.name = name;
        properties.mac = MacAt(portal->record, "mac");
        properties.complianceCode = ComplianceOf(portal->record);
        return properties;
      });
  nics.assign(1, known);
  nic = std::move(known);
}

void Adapter::GetPhysicalNetworkPortals(std::vector<iScsiPnpProperties>& portals) {
  portals = ref_.Read("GetPhysicalNetworkPortals", [](host::Tree& tree, const host::Object& adapter) {
    std::vector<iScsiPnpProperties> listed;
    for (const host::Object& portal : tree.Children(adapter.id, Kind::PhysicalPortal)) {
      Fill(listed.emplace_back(), kPhysicalMembers, portal.record);
      listed.back().mac = MacAt(portal.record, "mac");
    }
    return listed;
  });
}

void Adapter::GetLogicalNetworkPortals(std::vector<iScsiLnpProperties>& portals) {
  portals = ref_.Read("GetLogicalNetworkPortals", [](host::Tree& tree, const host::Object& adapter) {
    RequireCall(adapter, "network/logicalPortalsSupported", "IMA_TSR_GetLnpOidList");
    std::vector<iScsiLnpProperties> listed;
    if (adapter.record.GetString("kind") == "independent") {
      for (const host::Object& portal : tree.Children(adapter.id, Kind::LogicalPortal)) {
        listed.push_back({MacAt(portal.record, "mac"), portal.name});
      }
    } else {
      for (const host::Object& portal : tree.Children(adapter.id, Kind::NetworkPortal)) {
        listed.push_back({NicOf(tree, portal.name).mac, portal.name});
      }
    }
    return listed;
  });
}

void Adapter::BindHostnic(const std::string& nic, bool force) {
  ref_.Change("BindHostnic", {nic, force}, [&](host::Tree& tree, const host::Object& adapter) {
    if (adapter.record.GetString("kind") == "independent") {
      Deny(Why::NotSupported,
           "The adapter " + Quoted(adapter.name) + " has ports of its own, and takes no host NIC.");
    }
    const auto found = tree.Find(host::kRoot, Kind::Nic, nic);
    if (!found) Deny(Why::NotFound, "The host has no NIC " + Quoted(nic) + ".");
    if (!force && ComplianceOf(found->record) != iScsiPortErrorCodes::Compliant) {
      std::string reason = found->record.GetString("nonCompliantMessage");
      const std::string& remedy = found->record.GetString("nonCompliantRemedy");
      if (!remedy.empty()) reason += (reason.ends_with('.') ? " " : ". ") + remedy;
      Deny(Why::WrongState, "The NIC " + Quoted(nic) + " is not compliant: " + reason);
    }
    if (tree.Find(adapter.id, Kind::NetworkPortal, nic)) {
      Deny(Why::Exists,
           "The NIC " + Quoted(nic) + " is bound to the adapter " + Quoted(adapter.name) + " already.");
    }
    host::Record portal;
    portal.Set("nic", nic);
    tree.InsertNew(adapter.id, Kind::NetworkPortal, portal);
  });
}

void Adapter::UnbindHostnic(const std::string& nic, bool force) {
  ref_.Change("UnbindHostnic", {nic, force}, [&](host::Tree& tree, const host::Object& adapter) {
    const auto portal = tree.Find(adapter.id, Kind::NetworkPortal, nic);
    if (!portal)
      Deny(Why::NotFound,
           "The NIC " + Quoted(nic) + " is not bound to the adapter " + Quoted(adapter.name) + ".");
    const std::vector<host::Object> sessions = host::SessionsOver(tree, adapter, nic);
    if (!force && (!sessions.empty() || host::IsDescribedAsUsed(*portal))) {
      Deny(Why::InUse, "Active sessions use the NIC " + Quoted(nic) + ".");
    }
    for (const host::Object& session : sessions) host::LogoutSession(tree, session);
    tree.Remove(portal->id);
  });
}

}  // namespace corectl

namespace CoreCtl::Storage {

void StorageInfoImpl::GetiScsiBoundNicListWithPathStatus(
    std::string adapter, std::vector<NodeCtl::Storage::iScsiNicProperties>& nics) {
  nics =
      corectl::AdapterRef(std::move(adapter)).Read("GetiScsiBoundNicListWithPathStatus", corectl::BoundNics);
}

}  // namespace CoreCtl::Storage
