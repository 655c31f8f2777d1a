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
    {"metric", [](const Listed& listed) { return static_cast<long long>(listed.properties.metric); }},
    {"associated", [](const Listed& listed) { return listed.properties.associated != 0 ? "YES" : "NO"; }},
    {"interface", [](const Listed& listed) { return InterfaceText(listed.properties); }},
};
constexpr Structure kRoute = StructureOf<kColumns>("Route");

constexpr Parameter kParameters[] = {
    AdapterFilter(),
    String("nic", 'n', "The iSCSI network portal (hostnic)"),
};

}  // namespace

class __attribute__((visibility("default"))) RouteList : public CommandFrame<RouteList> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "List current iSCSI Routes.",
      .type = kFetcher,
      .formatter = "simple",
      .formatterParameters = {Setting("header:Route", "%adapter%"), FieldsFrom(0, "fields:Route")},
      .parameters = kParameters,
      .result = ListOf(kRoute),
  };

  StructPtr GetListType() const { return NewPrototype(kRoute); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    const Filter filter(*input, "adapter");
    PostImaList(output, kRoute, [&](auto& list) {
      for (const IMA_OID& oid : ImaList(InvalidAdapterMessage, IMA_GetLhbaOidList)) {
        const auto properties = ReadIma(IMA_GetLhbaProperties, oid, InvalidAdapterMessage);
        const std::string adapter = NarrowText(properties.osDeviceName, kNameSize);
        if (!filter.Passes(adapter)) continue;
        if (AppendRoutes(*input, oid, adapter, list) && input->HasParameter("adapter")) break;
      }
    });
  }

  /// An adapter whose routes cannot be listed shows none. False then, and the walk goes on behind it.
  static bool AppendRoutes(const Plinth::CallSpec::Input& input, const IMA_OID& oid,
                           const std::string& adapter, Plinth::MetaObj::MetaList& list) {
    const bool limited = input.HasParameter("nic");
    const std::string nic = input.GetString("nic");
    IMA_OID_LIST* listed = nullptr;
    if (IMA_TSR_GetRouteOidList(oid, &listed) != IMA_STATUS_SUCCESS) return false;
    for (const IMA_OID& route : ImaList(listed)) {
      const auto properties = ReadIma(IMA_TSR_GetRouteProperties, route, OperationNotSupportedMessage);
      if (limited && !IsInterface(properties.interfaceName, nic)) continue;
      list.Append(NewRow(kRoute, kColumns, {adapter, properties}));
    }
    return true;
  }
};

template __attribute__((visibility("default"))) NodePtr Make<RouteList>();

}  // namespace TessaroCli::IscsiNamespace
