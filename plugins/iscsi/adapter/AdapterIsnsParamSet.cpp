#include "discovery/IsnsRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Parameter kParameters[] = {
    Adapter(),
    String("key", 'k', "The iSNS parameter key.").Required(),
    String("value", 'v', "The iSNS parameter value."),
    Flag("default", 'D', "Resetting iSNS parameter setting to default."),
};

constexpr IsnsPlace kAdapterPlace{
    .inherits = false,
    .failureText =
        "Unable to set iSNS parameters. Please make sure parameter input is settable and within MAX/MIN "
        "range (integer takes numbers, bool takes [true/false,yes/no,y/n]).",
    .get = [](iScsiInterface& adapter, const iSnsConfig&) { return adapter.GetAdapterIsnsParms(); },
    .set =
        [](iScsiInterface& adapter, const iSnsConfig&, const iSnsParms& parms, const OutputPtr& output) {
          IscsiTools::ProcessStatus(&adapter, adapter.SetAdapterIsnsParms(parms), output);
        },
};

}  // namespace

class __attribute__((visibility("default"))) AdapterIsnsParamSet : public CommandFrame<AdapterIsnsParamSet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Set the iSNS parameter for the iSCSI Host Bus Adapter.",
      .type = kOperation,
      .parameters = kParameters,
      .result = Success(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    if (CountIsnsSources(input, kAdapterPlace.inherits) != 1) {
      return output->ReportError("The value and default options cannot be used together.");
    }
    SetIsnsParm(kAdapterPlace, {}, input, output);
  }
};

template __attribute__((visibility("default"))) NodePtr Make<AdapterIsnsParamSet>();

}  // namespace TessaroCli::IscsiNamespace
