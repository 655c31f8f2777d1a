#include "level/ChapRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {
    AdapterOption(),
    TargetName(),
    PortalAddress(),
    ChapDirection("The iSCSI authentication direction. Options are:%ENUM%"),
    StringOption("authname", 'N', "The iSCSI authentication name"),
    StringOption("secret", 'S', "The iSCSI authentication password").Sensitive(),
    ChapLevel("The iSCSI authentication level. Options are:%ENUM%"),
    FlagOption("inherit", 'I', "Inheriting iSCSI authentication setting from parent."),
    FlagOption("default", 'D', "Resetting iSCSI authentication setting to default."),
};

}  // namespace

class AdapterTargetPortalAuthChapSet : public CommandFrame<AdapterTargetPortalAuthChapSet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Set the iSCSI CHAP authentication for the iSCSI Target.",
      .type = kOperation,
      .options = kOptions,
      .result = SuccessResult(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    constexpr char kFailure[] = "Unable to set CHAP authentication.";
    WithAdapter(input, output, Reporting(kFailure), [&](iScsiInterface& adapter) {
      const std::string name = input->GetString("name");
      const std::string address = input->GetString("address");
      const std::string word = input->GetString("direction");
      TargetPortalLevel level(adapter, {name, IscsiTools::GetTargetAddressFromString(address)});
      SetInheritingChap(level, word, input, output);
    });
  }
};

template NodePtr Make<AdapterTargetPortalAuthChapSet>();

}  // namespace TessaroCli::IscsiNamespace
