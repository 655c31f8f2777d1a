#include "level/ChapRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {
    AdapterOption(),
    SendTargetAddress(),
    ChapDirection("The iSCSI authentication direction. Options are:%ENUM%"),
    StringOption("authname", 'N', "The iSCSI authentication name"),
    StringOption("secret", 'S', "The iSCSI authentication secret").Sensitive(),
    ChapLevel("The iSCSI authentication level. Options are:%ENUM%"),
    FlagOption("inherit", 'I', "Inheriting iSCSI authentication setting from parent."),
    FlagOption("default", 'D', "Resetting iSCSI authentication setting to default."),
};

}  // namespace

class AdapterDiscoverySendtargetAuthChapSet : public CommandFrame<AdapterDiscoverySendtargetAuthChapSet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Set iSCSI CHAP authentication on a sendtarget address",
      .type = kOperation,
      .options = kOptions,
      .result = SuccessResult(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    constexpr char kFailure[] = "Failed to set CHAP authentication configuration.";
    WithAdapter(input, output, Reporting(kFailure), [&](iScsiInterface& adapter) {
      const std::string address = input->GetString("address");
      const std::string word = input->GetString("direction");
      SendTargetLevel level(adapter, IscsiTools::GetTargetAddressFromString(address));
      SetInheritingChap(level, word, input, output);
    });
  }
};

template NodePtr Make<AdapterDiscoverySendtargetAuthChapSet>();

}  // namespace TessaroCli::IscsiNamespace
