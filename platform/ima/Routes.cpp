/// Routes of an adapter.
#include <ima/ima_tsr.h>

#include <algorithm>
#include <bit>
#include <cstring>

#include "host/Formats.h"
#include "ima/Objects.h"
#include "ima/Portals.h"

using host::Error;
using host::Kind;
using host::Object;
using host::Tree;

namespace {

/// The addresses of the entry @p route of the adapter, and how they are called.
constexpr struct {
  const char* key;
  IMA_IP_ADDRESS IMA_TSR_ROUTE_PROPERTIES::*address;
} kAddresses[] = {
    {"destination", &IMA_TSR_ROUTE_PROPERTIES::destination},
    {"netmask", &IMA_TSR_ROUTE_PROPERTIES::netmask},
    {"gateway", &IMA_TSR_ROUTE_PROPERTIES::gateway},
};

/// True for ones, then zeros.
bool IsNetmask(const IMA_IP_ADDRESS& mask) {
  bool ended = false;
  for (int i = 0; i < (mask.ipv4Address ? 4 : 16); ++i) {
    const unsigned inverse = ~mask.ipAddress[i] & 0xffu;
    if ((inverse & (inverse + 1)) != 0 || (ended && inverse != 0xff)) return false;
    ended = ended || inverse != 0;
  }
  return true;
}

void Judge(const IMA_TSR_ROUTE_PROPERTIES& route) {
  const IMA_BOOL ipv4 = route.destination.ipv4Address;
  if (route.netmask.ipv4Address != ipv4 || route.gateway.ipv4Address != ipv4) {
    throw Error(Error::Kind::Invalid, "The addresses of the route are of different families.");
  }
  if (!IsNetmask(route.netmask)) throw Error(Error::Kind::Invalid, "The netmask of the route has gaps.");
  for (int i = 0; i < (ipv4 ? 4 : 16); ++i) {
    if ((route.destination.ipAddress[i] & ~route.netmask.ipAddress[i]) != 0) {
      throw Error(Error::Kind::Invalid, "The destination of the route is not the address of its network.");
    }
  }
}

std::string InterfaceText(const char (&name)[IMA_TSR_INTERFACE_NAME_SIZE]) {
  return {name, strnlen(name, sizeof name)};
}

host::Record RecordOf(const IMA_TSR_ROUTE_PROPERTIES& route) {
  host::Record record;
  for (const auto& [key, address] : kAddresses) record.Set(key, ima::AddressText(route.*address));
  record.Set("metric", std::int64_t{route.metric});
  record.Set("associated", false);
  record.Set("interface", InterfaceText(route.interfaceName));
  return record;
}

bool IsSame(const host::Record& a, const host::Record& b) {
  const auto text = [&](const char* key) { return a.GetString(key) == b.GetString(key); };
  return text("destination") && text("netmask") && text("gateway") && text("interface") &&
         a.GetInt64("metric") == b.GetInt64("metric");
}

/// The route @p routeOid of the adapter, and the name of its portal @p portalOid.
struct Association {
  Association(Tree& tree, const IMA_OID& lhbaOid, const IMA_OID& routeOid, const IMA_OID& portalOid)
      : route(ima::Get(tree, routeOid, ima::kRouteType)) {
    const Object adapter = ima::Get(tree, lhbaOid, IMA_OBJECT_TYPE_LHBA);
    const Object found = ima::GetPortal(tree, portalOid, IMA_OBJECT_TYPE_NETWORK_PORTAL);
    if (route.parent != adapter.id || found.parent != adapter.id) {
      throw Error(Error::Kind::NotFound, "The adapter " + adapter.name + " has no such route or portal.");
    }
    portal = found.name.substr(0, IMA_TSR_INTERFACE_NAME_SIZE);
  }

  Object route;
  std::string portal;
};

host::Call AssociationCall(host::Operation operation, const IMA_OID& lhbaOid, const IMA_OID& routeOid,
                           const IMA_OID& portalOid) {
  return host::Call::Ima(
      operation, ima::Id(lhbaOid),
      {ima::OidArgument(lhbaOid), ima::OidArgument(routeOid), ima::OidArgument(portalOid)});
}

}  // namespace

extern "C" IMA_STATUS IMA_TSR_GetRouteOidList(IMA_OID lhbaOid, IMA_OID_LIST** list) {
  return ima::ListChildren("IMA_TSR_GetRouteOidList", lhbaOid, IMA_OBJECT_TYPE_LHBA, Kind::Route,
                           ima::kRouteType, list);
}

extern "C" IMA_STATUS IMA_TSR_GetRouteProperties(IMA_OID routeOid, IMA_TSR_ROUTE_PROPERTIES* properties) {
  return ima::ReadProperties(
      "IMA_TSR_GetRouteProperties", routeOid, ima::kRouteType, properties,
      [](Tree&, const Object& route, IMA_TSR_ROUTE_PROPERTIES& filled) {
        const host::Record& record = route.record;
        for (const auto& [key, address] : kAddresses) {
          filled.*address = ima::Address(record.GetString(key));
        }
        filled.metric = ima::Unsigned(record, "metric");
        filled.associated = ima::Bool(record, "associated");
        record.GetString("interface").copy(filled.interfaceName, sizeof filled.interfaceName);
      });
}

extern "C" IMA_STATUS IMA_TSR_AddRoute(IMA_OID lhbaOid, IMA_TSR_ROUTE_PROPERTIES properties,
                                       IMA_OID* routeOid) {
  const auto call = host::Call::Ima(
      "IMA_TSR_AddRoute", ima::Id(lhbaOid),
      {ima::OidArgument(lhbaOid), ima::AddressText(properties.destination),
       ima::AddressText(properties.netmask), ima::AddressText(properties.gateway), properties.metric});
  return ima::Change(call, [&](Tree& tree) {
    const Object adapter = ima::Get(tree, lhbaOid, IMA_OBJECT_TYPE_LHBA);
    Judge(properties);
    const host::Record record = RecordOf(properties);
    for (const Object& route : tree.Children(adapter.id, Kind::Route)) {
      if (IsSame(route.record, record)) throw Error(Error::Kind::Exists, "The route exists already.");
    }
    *routeOid = ima::Oid(ima::kRouteType, tree.InsertNew(adapter.id, Kind::Route, record).id);
  });
}

extern "C" IMA_STATUS IMA_TSR_RemoveRoute(IMA_OID routeOid) {
  const auto call = host::Call::Ima("IMA_TSR_RemoveRoute", ima::Id(routeOid), {ima::OidArgument(routeOid)});
  return ima::Change(call, [&](Tree& tree) { tree.Remove(ima::Get(tree, routeOid, ima::kRouteType).id); });
}

extern "C" IMA_STATUS IMA_TSR_AssociateRoute(IMA_OID lhbaOid, IMA_OID routeOid, IMA_OID portalOid) {
  return ima::Change(
      AssociationCall("IMA_TSR_AssociateRoute", lhbaOid, routeOid, portalOid), [&](Tree& tree) {
        Association association(tree, lhbaOid, routeOid, portalOid);
        Object& route = association.route;
        if (route.record.GetBool("associated")) {
          throw Error(Error::Kind::Exists,
                      "The route belongs to " + route.record.GetString("interface") + " already.");
        }
        route.record.Set("associated", true);
        route.record.Set("interface", association.portal);
        tree.Update(route);
      });
}

extern "C" IMA_STATUS IMA_TSR_DisassociateRoute(IMA_OID lhbaOid, IMA_OID routeOid, IMA_OID portalOid) {
  return ima::Change(
      AssociationCall("IMA_TSR_DisassociateRoute", lhbaOid, routeOid, portalOid), [&](Tree& tree) {
        Association association(tree, lhbaOid, routeOid, portalOid);
        Object& route = association.route;
        if (!route.record.GetBool("associated") ||
            route.record.GetString("interface") != association.portal) {
          throw Error(Error::Kind::NotFound, "The route does not belong to " + association.portal + ".");
        }
        route.record.Set("associated", false);
        tree.Update(route);
      });
}
