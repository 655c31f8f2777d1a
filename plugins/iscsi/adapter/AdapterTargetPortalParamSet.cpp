#include "level/ParmRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Parameter kParameters[] = {
    Adapter(),
    TargetName(),
    PortalAddress(),
    String("key", 'k', "The iSCSI parameter key").Required(),
    String("value", 'v', "The iSCSI parameter value"),
    Flag("inherit", 'I', "Inheriting iSCSI parameter setting from parent."),
    Flag("default", 'D', "Resetting iSCSI parameter setting to default."),
};

}  // namespace

class AdapterTargetPortalParamSet : public CommandFrame<AdapterTargetPortalParamSet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Set the iSCSI parameter for the iSCSI Target.",
      .type = kOperation,
      .parameters = kParameters,
      .result = Success(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override { SetParm(kTargetLevel, input, output); }
};

template NodePtr Make<AdapterTargetPortalParamSet>();

}  // namespace TessaroCli::IscsiNamespace
