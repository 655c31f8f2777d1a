#include "UnregisteredCommands.h"
#include "host/Route.h"

namespace TessaroCli::IscsiNamespace {
namespace {

struct Listed {
  const std::string& adapter;
  const IMA_TSR_ROUTE_PROPERTIES& properties;
};

std::string InterfaceText(const IMA_TSR_ROUTE_PROPERTIES& properties) {
  return {properties.interfaceName, strnlen(properties.interfaceName, sizeof properties.interfaceName)};
}

constexpr Column<Listed> kColumns[] = {
    {"adapter", [](const Listed& listed) { return listed.adapter; }},
    {"destination", [](const Listed& listed) { return AddressText(listed.properties.destination); }},
    {"netmask", [](const Listed& listed) { return AddressText(listed.properties.netmask); }},
    {"gateway", [](const Listed& listed) { return AddressText(listed.properties.gateway); }},
    {"metric", Property<&IMA_TSR_ROUTE_PROPERTIES::metric>},
    {"associated", [](const Listed& listed) { return listed.properties.associated != 0 ? "YES" : "NO"; }},
    {"interface", [](const Listed& listed) { return InterfaceText(listed.properties); }},
};
constexpr auto kRoute = StructureOf<kColumns>("Route");

constexpr Option kOptions[] = {
    AdapterFilter(),
    StringOption("nic", 'n', "The iSCSI network portal (hostnic)"),
};

}  // namespace

constexpr Declaration RouteList::kDeclaration{
    .description = "List current iSCSI Routes.",
    .type = kFetcher,
    .formatter = "simple",
    .formatterSettings = {Setting("header:Route", "%adapter%"), FieldsFrom(0, kRoute, "fields:Route")},
    .options = kOptions,
    .result = ListResult(),
};

boost::shared_ptr<RouteList> RouteList::New() { return CommandFrame::New(); }

StructPtr RouteList::GetListType() const { return NewPrototype(kRoute); }

void RouteList::ExecuteInternal(InputPtr input, OutputPtr output) {
  const std::string wanted = input->GetString("adapter");
  const std::string nic = input->GetString("nic");
  PostImaList(output, GetListType(), [&](auto& list) {
    for (const IMA_OID& oid : ImaList(InvalidAdapterMessage, IMA_GetLhbaOidList)) {
      const auto adapter = ReadIma(IMA_GetLhbaProperties, oid, InvalidAdapterMessage);
      const std::string name = NarrowText(adapter.osDeviceName, kNameSize);
      if (input->HasParameter("adapter") && name != wanted) continue;
      IMA_OID_LIST* given = nullptr;
      if (IMA_TSR_GetRouteOidList(oid, &given) != IMA_STATUS_SUCCESS) continue;  // it has none to show
      for (const IMA_OID& route : ImaList(given)) {
        const auto properties = ReadIma(IMA_TSR_GetRouteProperties, route, OperationNotSupportedMessage);
        if (input->HasParameter("nic") && !IsInterface(properties.interfaceName, nic)) continue;
        list.Append(NewRow(kRoute, {name, properties}));
      }
      if (input->HasParameter("adapter")) break;
    }
  });
}

}  // namespace TessaroCli::IscsiNamespace
