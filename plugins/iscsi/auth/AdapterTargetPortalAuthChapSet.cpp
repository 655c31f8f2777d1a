#include "level/ChapRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Parameter kParameters[] = {
    Adapter(),
    TargetName(),
    PortalAddress(),
    ChapDirection("The iSCSI authentication direction. Options are:%ENUM%"),
    String("authname", 'N', "The iSCSI authentication name"),
    String("secret", 'S', "The iSCSI authentication password").Sensitive(),
    ChapLevel("The iSCSI authentication level. Options are:%ENUM%"),
    Flag("inherit", 'I', "Inheriting iSCSI authentication setting from parent."),
    Flag("default", 'D', "Resetting iSCSI authentication setting to default."),
};

}  // namespace

class AdapterTargetPortalAuthChapSet : public CommandFrame<AdapterTargetPortalAuthChapSet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Set the iSCSI CHAP authentication for the iSCSI Target.",
      .type = kOperation,
      .parameters = kParameters,
      .result = Success(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override { SetChap(kTargetLevel, input, output); }
};

template NodePtr Make<AdapterTargetPortalAuthChapSet>();

}  // namespace TessaroCli::IscsiNamespace
