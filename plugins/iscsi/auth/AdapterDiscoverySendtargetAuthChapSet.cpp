#include "level/ChapRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Parameter kParameters[] = {
    Adapter(),
    SendTargetAddress(),
    ChapDirection("The iSCSI authentication direction. Options are:%ENUM%"),
    String("authname", 'N', "The iSCSI authentication name"),
    String("secret", 'S', "The iSCSI authentication secret").Sensitive(),
    ChapLevel("The iSCSI authentication level. Options are:%ENUM%"),
    Flag("inherit", 'I', "Inheriting iSCSI authentication setting from parent."),
    Flag("default", 'D', "Resetting iSCSI authentication setting to default."),
};

}  // namespace

class AdapterDiscoverySendtargetAuthChapSet : public CommandFrame<AdapterDiscoverySendtargetAuthChapSet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Set iSCSI CHAP authentication on a sendtarget address",
      .type = kOperation,
      .parameters = kParameters,
      .result = Success(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    SetChap(kSendTargetLevel, input, output);
  }
};

template NodePtr Make<AdapterDiscoverySendtargetAuthChapSet>();

}  // namespace TessaroCli::IscsiNamespace
