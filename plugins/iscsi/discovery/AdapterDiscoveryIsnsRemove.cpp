#include "discovery/IsnsRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Parameter kParameters[] = {
    Adapter(),
    IsnsAddress("The iSCSI iSNS discovery address: <ip/dns>. Required only for static discovery method."),
    IsnsMethod(),
};

}  // namespace

class __attribute__((visibility("default"))) AdapterDiscoveryIsnsRemove
    : public CommandFrame<AdapterDiscoveryIsnsRemove> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Remove iSNS discovery address",
      .type = kOperation,
      .parameters = kParameters,
      .result = Success(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    const auto server = ServerFrom(input, output, "Failed to remove iSNS discovery address..");
    if (!server) return;
    WithIsnsAdapter(input, output, "Unable to remove iSNS discovery address.", [&](iScsiInterface& adapter) {
      adapter.RemoveIsnsConfig(*server);
      PostSuccess(output);
    });
  }
};

template __attribute__((visibility("default"))) NodePtr Make<AdapterDiscoveryIsnsRemove>();

}  // namespace TessaroCli::IscsiNamespace
