#include <cstring>

#include "host/Route.h"

namespace TessaroCli::IscsiNamespace {
namespace {

IMA_IP_ADDRESS Address(const std::string& text, const char* failure) {
  const IMA_IP_ADDRESS* address = IscsiTools::GetImaIpAddressFromString(text.c_str());
  if (address == nullptr) throw IscsiUtil::ImaFailure{failure};
  return *address;
}

}  // namespace

class __attribute__((visibility("default"))) RouteAdd : public CommandFrame<RouteAdd> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Add a route entry for iSCSI adapter.",
      .type = kOperation,
      .parameters = kRouteParameters,
      .result = Success(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    WithRoute(input, output, [&](const IMA_OID& adapter, const RouteText& route) {
      const IMA_OID portal = FindPortal(adapter, route.nic);
      IMA_TSR_ROUTE_PROPERTIES properties{};
      properties.destination = Address(route.destination, "Unable to parse destination IP address.");
      properties.netmask = Address(route.netmask, "Unable to parse netmask IP address.");
      properties.gateway = Address(route.gateway, "Unable to parse gateway IP address.");
      properties.metric = static_cast<IMA_UINT32>(route.metric);
      route.nic.copy(properties.interfaceName, sizeof properties.interfaceName);

      IMA_OID added;
      CheckIma(IMA_TSR_AddRoute(adapter, properties, &added), "Add route failed.");
      if (IMA_TSR_AssociateRoute(adapter, added, portal) == IMA_STATUS_SUCCESS) return PostSuccess(output);
      // An entry without a portal must not stay.
      output->ReportError("Associate route failed.");
      CheckIma(IMA_TSR_RemoveRoute(added), "Remove route failed.");
    });
  }
};

template __attribute__((visibility("default"))) NodePtr Make<RouteAdd>();

}  // namespace TessaroCli::IscsiNamespace
