/// Static targets. Target portals that were found through a sendtarget are none.
#include "host/Formats.h"
#include "ima/ConfigItems.h"
#include "ima/Objects.h"

using host::Kind;
using host::Object;
using host::Tree;

namespace {

/// @p id is all zeros.
void SetHost(IMA_HOST_ID& id, std::string_view host) {
  const IMA_IP_ADDRESS address = ima::Address(host);
  if (address.ipv4Address || host::ParseIpv6(host)) {
    id.id.ipAddress = address;
  } else {
    id.hostnameInUse = IMA_TRUE;
    ima::SetWide(id.id.hostname, host);
  }
}

}  // namespace

IMA_UINT32 ima::ReadBootTarget(Tree& tree, const IMA_OID& staticTargetOid) {
  return See(tree, staticTargetOid, IMA_OBJECT_TYPE_STATIC_DISC_TARGET).record.GetBool("boot") ? 1 : 0;
}

extern "C" IMA_STATUS IMA_GetStaticDiscoveryTargetOidList(IMA_OID lhbaOid, IMA_OID_LIST** list) {
  return ima::ReadObject("IMA_GetStaticDiscoveryTargetOidList", lhbaOid, [&](Tree& tree) {
    const Object adapter = ima::Get(tree, lhbaOid, IMA_OBJECT_TYPE_LHBA);
    std::vector<std::int64_t> ids;
    tree.ForEachChild(adapter.id, Kind::StaticTarget, [&](std::int64_t id, const host::Record& target) {
      if (host::IsStatic(target)) ids.push_back(id);
    });
    *list = ima::OidList(IMA_OBJECT_TYPE_STATIC_DISC_TARGET, ids).release();
  });
}

extern "C" IMA_STATUS IMA_GetStaticDiscoveryTargetProperties(
    IMA_OID staticTargetOid, IMA_STATIC_DISCOVERY_TARGET_PROPERTIES* properties) {
  return ima::ReadProperties("IMA_GetStaticDiscoveryTargetProperties", staticTargetOid,
                             IMA_OBJECT_TYPE_STATIC_DISC_TARGET, properties,
                             [](Tree&, const Object& target, IMA_STATIC_DISCOVERY_TARGET_PROPERTIES& filled) {
                               ima::SetWide(filled.targetName, target.record.GetText("name"));
                               SetHost(filled.targetAddress, target.record.GetText("host"));
                               filled.port = ima::Unsigned16(target.record, "port");
                               if (!target.record.Has("portalGroup")) return;
                               filled.tpgtPresent = 1;
                               filled.tpgt = ima::Unsigned(target.record, "portalGroup");
                             });
}
