#include "ima/Portals.h"

#include <ima/ima_tsr.h>

#include <algorithm>

#include "host/Formats.h"
#include "host/Storage.h"

using host::Kind;
using host::Object;
using host::Tree;

namespace {

/// The host NIC that is bound; none behind a portal of the adapter's own.
std::optional<Object> NicOf(Tree& tree, const Object& portal) {
  if (portal.kind != Kind::NetworkPortal) return {};
  return tree.Find(host::kRoot, Kind::Nic, portal.record.GetString("nic"));
}

}  // namespace

namespace ima {

Object GetPortal(Tree& tree, const IMA_OID& oid, IMA_OBJECT_TYPE type) {
  const std::int64_t id = IdOfType(oid, type);
  const std::optional<Object> portal = tree.Lookup(id);
  return portal && portal->kind == Kind::LogicalPortal ? *portal : tree.Get(id, Kind::NetworkPortal);
}

}  // namespace ima

extern "C" IMA_STATUS IMA_TSR_GetNetworkPortalOidList(IMA_OID lhbaOid, IMA_OID_LIST** list) {
  return ima::ReadObject("IMA_TSR_GetNetworkPortalOidList", lhbaOid, [&](Tree& tree) {
    const Object adapter = ima::Get(tree, lhbaOid, IMA_OBJECT_TYPE_LHBA);
    std::vector<std::int64_t> ids = tree.ChildIds(adapter.id, Kind::NetworkPortal);
    const std::vector<std::int64_t> own = tree.ChildIds(adapter.id, Kind::LogicalPortal);
    ids.insert(ids.end(), own.begin(), own.end());
    *list = ima::OidList(IMA_OBJECT_TYPE_NETWORK_PORTAL, ids).release();
  });
}

extern "C" IMA_STATUS IMA_GetNetworkPortalProperties(IMA_OID portalOid,
                                                     IMA_NETWORK_PORTAL_PROPERTIES* properties) {
  return ima::ReadObject("IMA_GetNetworkPortalProperties", portalOid, [&](Tree& tree) {
    const Object portal = ima::GetPortal(tree, portalOid, IMA_OBJECT_TYPE_NETWORK_PORTAL);
    const auto nic = NicOf(tree, portal);
    const std::string address =
        nic ? nic->record.GetString("ipv4Address")
            : tree.Get(portal.parent, Kind::Adapter).record.GetString("network/ipv4Address");
    *properties = {ima::Address(address), ima::Oid(IMA_OBJECT_TYPE_LNP, portal.id)};
  });
}

extern "C" IMA_STATUS IMA_TSR_GetLnpProperties(IMA_OID lnpOid, IMA_TSR_LNP_PROPERTIES* properties) {
  return ima::ReadObject("IMA_TSR_GetLnpProperties", lnpOid, [&](Tree& tree) {
    const Object portal = ima::GetPortal(tree, lnpOid, IMA_OBJECT_TYPE_LNP);
    if (!tree.Get(portal.parent, Kind::Adapter).record.GetBool("network/logicalPortalsSupported")) {
      throw host::Error(host::Error::Kind::NotSupported, "The adapter cannot tell its logical portals.");
    }
    const auto nic = NicOf(tree, portal);
    IMA_TSR_LNP_PROPERTIES filled{};
    portal.name.copy(filled.name, sizeof filled.name);
    if (const auto mac = host::ParseMac((nic ? *nic : portal).record.GetString("mac"))) {
      std::copy(mac->begin(), mac->end(), filled.macAddress);
    }
    *properties = filled;
  });
}
