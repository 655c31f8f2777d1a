#include "level/ParmRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Parameter kParameters[] = {
    Adapter(),
    SendTargetAddress(),
    String("key", 'k', "The iSCSI parameter key").Required(),
    String("value", 'v', "The iSCSI parameter value"),
    Flag("inherit", 'I', "Inheriting iSCSI parameter setting from parent."),
    Flag("default", 'D', "Resetting iSCSI parameter setting to default."),
};

}  // namespace

class AdapterDiscoverySendtargetParamSet : public CommandFrame<AdapterDiscoverySendtargetParamSet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Set the iSCSI parameter for the iSCSI Sendtarget.",
      .type = kOperation,
      .parameters = kParameters,
      .result = Success(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    SetParm(kSendTargetLevel, input, output);
  }
};

template NodePtr Make<AdapterDiscoverySendtargetParamSet>();

}  // namespace TessaroCli::IscsiNamespace
