#include "discovery/IsnsRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr char kFailure[] = "Failed to get iSNS parameter configuration.";

constexpr Parameter kParameters[] = {
    Adapter(),
    IsnsAddress("The iSNS discovery address: <ip/dns>. Required for only static discovery method."),
    IsnsMethod(),
};

}  // namespace

class __attribute__((visibility("default"))) AdapterDiscoveryIsnsParamGet
    : public CommandFrame<AdapterDiscoveryIsnsParamGet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Get parameters on iSNS discovery address",
      .type = kFetcher,
      .formatter = "table",
      .formatterParameters = {FieldsFrom(1, "fields")},
      .parameters = kParameters,
      .result = ListOf(kParm),
  };

  StructPtr GetOutputStructure() const { return IscsiTools::ParmStructure(); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    const auto server = ServerFrom(input, output, kFailure);
    if (!server) return;
    WithIsnsAdapter(input, output, kFailure,
                    [&](iScsiInterface& adapter) { ShowIsnsParm(adapter.GetIsnsParms(*server), output); });
  }
};

template __attribute__((visibility("default"))) NodePtr Make<AdapterDiscoveryIsnsParamGet>();

}  // namespace TessaroCli::IscsiNamespace
