#include <cstring>

#include "host/Route.h"

namespace TessaroCli::IscsiNamespace {
namespace {

/// Compares the first 20 bytes.
bool IsAddress(const IMA_IP_ADDRESS& address, const std::string& text) {
  return std::strncmp(AddressText(address).c_str(), text.c_str(), 20) == 0;
}

bool IsRoute(const IMA_TSR_ROUTE_PROPERTIES& properties, const RouteText& route) {
  return IsAddress(properties.destination, route.destination) &&
         IsAddress(properties.netmask, route.netmask) && IsAddress(properties.gateway, route.gateway) &&
         static_cast<long>(properties.metric) == route.metric &&
         IsInterface(properties.interfaceName, route.nic);
}

}  // namespace

class __attribute__((visibility("default"))) RouteRemove : public CommandFrame<RouteRemove> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Remove a route entry for iSCSI adapter.",
      .type = kOperation,
      .parameters = kRouteParameters,
      .result = Success(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    WithRoute(input, output, [&](const IMA_OID& adapter, const RouteText& wanted) {
      const ImaList routes(OperationNotSupportedMessage, IMA_TSR_GetRouteOidList, adapter);
      const auto route =
          FindIma(routes, IMA_TSR_GetRouteProperties, OperationNotSupportedMessage,
                  [&](const IMA_TSR_ROUTE_PROPERTIES& properties) { return IsRoute(properties, wanted); });
      if (!route) return output->ReportError("Unable to find route.");
      const IMA_OID portal = FindPortal(adapter, wanted.nic);
      CheckIma(IMA_TSR_DisassociateRoute(adapter, *route, portal), "Disassociate route failed.");
      CheckIma(IMA_TSR_RemoveRoute(*route), "Remove route failed.");
      PostSuccess(output);
    });
  }
};

template __attribute__((visibility("default"))) NodePtr Make<RouteRemove>();

}  // namespace TessaroCli::IscsiNamespace
