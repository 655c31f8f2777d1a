#include "discovery/IsnsRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr char kFailure[] = "Failed to get iSNS parameter configuration.";

constexpr Parameter kParameters[] = {
    Adapter(),
};

}  // namespace

class __attribute__((visibility("default"))) AdapterIsnsParamGet : public CommandFrame<AdapterIsnsParamGet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Get the iSNS parameters for the iSCSI Host Bus Adapter.",
      .type = kFetcher,
      .formatter = "table",
      .formatterParameters = {FieldsFrom(1, "fields")},
      .parameters = kParameters,
      .result = ListOf(kParm),
  };

  StructPtr GetOutputStructure() const { return IscsiTools::ParmStructure(); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    WithIsnsAdapter(input, output, kFailure,
                    [&](iScsiInterface& adapter) { ShowIsnsParm(adapter.GetAdapterIsnsParms(), output); });
  }
};

template __attribute__((visibility("default"))) NodePtr Make<AdapterIsnsParamGet>();

}  // namespace TessaroCli::IscsiNamespace
