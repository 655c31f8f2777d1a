#include "level/ParmRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Parameter kParameters[] = {
    Adapter(),
    String("key", 'k', "The iSCSI initiator parameter key.").Required(),
    String("value", 'v', "The iSCSI initiator parameter value."),
    Flag("default", 'D', "Resetting iSCSI parameter setting to default."),
};

}  // namespace

class AdapterParamSet : public CommandFrame<AdapterParamSet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Set the iSCSI parameter for the iSCSI Host Bus Adapter.",
      .type = kOperation,
      .parameters = kParameters,
      .result = Success(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override { SetParm(kAdapterLevel, input, output); }
};

template NodePtr Make<AdapterParamSet>();

}  // namespace TessaroCli::IscsiNamespace
