/// Targets and their addresses.
#include "host/TargetSchema.h"
#include "ima/Objects.h"

using host::Record;
using host::Tree;

namespace {

IMA_UINT32 MethodFlag(int word) { return IMA_TARGET_DISCOVERY_METHOD_STATIC << word; }

/// By what the target was discovered: its own word for it, and that of the portals that lead to it.
IMA_UINT32 DiscoveryFlags(const host::KnownTarget& target) {
  static_assert(std::size(host::kDiscoveryMethods) == 4);
  IMA_UINT32 flags = 0;
  const Record& record = target.object.record;
  for (std::size_t i = 0; i < record.GetSize("discoveryMethods"); ++i) {
    flags |= MethodFlag(record.GetWord("discoveryMethods/" + std::to_string(i), host::kDiscoveryMethods));
  }
  for (const Record& portal : target.portals) {
    if (host::IsStatic(portal)) flags |= IMA_TARGET_DISCOVERY_METHOD_STATIC;
    if (portal.Has("sendTarget")) flags |= IMA_TARGET_DISCOVERY_METHOD_SENDTARGETS;
  }
  return flags;
}

}  // namespace

extern "C" IMA_STATUS IMA_GetTargetOidList(IMA_OID lhbaOid, IMA_OID_LIST** list) {
  return ima::ReadObject("IMA_GetTargetOidList", lhbaOid, [&](Tree& tree) {
    const host::Object adapter = ima::Get(tree, lhbaOid, IMA_OBJECT_TYPE_LHBA);
    *list = ima::OidList(IMA_OBJECT_TYPE_TARGET, host::TargetIds(tree, adapter.id)).release();
  });
}

extern "C" IMA_STATUS IMA_GetTargetProperties(IMA_OID targetOid, IMA_TARGET_PROPERTIES* properties) {
  return ima::ReadObject("IMA_GetTargetProperties", targetOid, [&](Tree& tree) {
    const host::KnownTarget target = ima::GetTarget(tree, targetOid);
    const Record& record = target.object.record;
    IMA_TARGET_PROPERTIES filled{};
    ima::SetWide(filled.name, record.GetText("name"));
    ima::SetWide(filled.alias, record.GetText("alias"));
    filled.discoveryMethodFlags = DiscoveryFlags(target);
    filled.sendTargetsDiscoverySettable = ima::Bool(record, "sendTargetsDiscoverySettable");
    filled.sendTargetsDiscoveryEnabled = ima::Bool(record, "sendTargetsDiscoveryEnabled");
    *properties = filled;
  });
}

extern "C" IMA_STATUS IMA_GetAddressKeys(IMA_OID targetOid, IMA_ADDRESS_KEYS** keys) {
  return ima::ReadObject("IMA_GetAddressKeys", targetOid, [&](Tree& tree) {
    const std::vector<Record> addresses = host::AddressesOf(ima::GetTarget(tree, targetOid));
    auto filled = ima::NewList<IMA_ADDRESS_KEYS, IMA_ADDRESS_KEY>(addresses.size());
    IMA_ADDRESS_KEY* key = filled->addressKeys;
    for (const Record& address : addresses) {
      *key++ = {.address = ima::Address(address.GetString("address")),
                .portAndTagPresent = ima::Unsigned(address, "portAndTagPresent"),
                .portNumber = ima::Unsigned16(address, "port"),
                .targetPortalGroupTag = ima::Unsigned16(address, "tag")};
    }
    filled->addressKeyCount = static_cast<IMA_UINT>(addresses.size());
    *keys = filled.release();
  });
}
