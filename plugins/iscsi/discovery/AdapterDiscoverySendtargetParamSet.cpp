#include "level/ParmRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {
    AdapterOption(),
    SendTargetAddress(),
    StringOption("key", 'k', "The iSCSI parameter key").Required(),
    StringOption("value", 'v', "The iSCSI parameter value"),
    FlagOption("inherit", 'I', "Inheriting iSCSI parameter setting from parent."),
    FlagOption("default", 'D', "Resetting iSCSI parameter setting to default."),
};

}  // namespace

class AdapterDiscoverySendtargetParamSet : public CommandFrame<AdapterDiscoverySendtargetParamSet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Set the iSCSI parameter for the iSCSI Sendtarget.",
      .type = kOperation,
      .options = kOptions,
      .result = SuccessResult(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    if (CountGiven(input, {"value", "inherit", "default"}) != 1) return output->ReportError(kOnlyOneMessage);
    if (!KeyAndValueAreSound(input, output)) return;
    WithAdapter(input, output, Reporting(kParmSetFailure), [&](iScsiInterface& adapter) {
      const std::string address = input->GetString("address");
      const std::string key = input->GetString("key");
      SendTargetLevel level(adapter, IscsiTools::GetTargetAddressFromString(address));
      SetInheritingParm(level, adapter.GetCapabilities(), key, input, output);
    });
  }
};

template NodePtr Make<AdapterDiscoverySendtargetParamSet>();

}  // namespace TessaroCli::IscsiNamespace
