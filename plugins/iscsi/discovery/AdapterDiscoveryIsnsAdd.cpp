#include "discovery/IsnsRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Parameter kParameters[] = {
    Adapter(),
    IsnsAddress("The iSNS discovery address: <ip/dns>. Required only for static discovery method."),
    IsnsMethod(),
};

}  // namespace

class __attribute__((visibility("default"))) AdapterDiscoveryIsnsAdd
    : public CommandFrame<AdapterDiscoveryIsnsAdd> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Add iSNS discovery address",
      .type = kOperation,
      .parameters = kParameters,
      .result = Success(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    const auto server = ServerFrom(input, output, "Unable to add iSNS discovery address.");
    if (!server) return;
    WithIsnsAdapter(input, output, "Unable to add iSNS discovery address.", [&](iScsiInterface& adapter) {
      adapter.AddIsnsConfig(*server);
      PostSuccess(output);
    });
  }
};

template __attribute__((visibility("default"))) NodePtr Make<AdapterDiscoveryIsnsAdd>();

}  // namespace TessaroCli::IscsiNamespace
