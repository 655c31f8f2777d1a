#include "level/ChapRules.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Parameter kParameters[] = {
    Adapter(),
    ChapDirection("The iSCSI CHAP authentication direction. Options are:%ENUM%"),
    String("authname", 'N', "The iSCSI CHAP authentication name"),
    String("secret", 'S', "The iSCSI CHAP authentication secret").Sensitive(),
    ChapLevel("The iSCSI CHAP authentication level. Options are:%ENUM%"),
    Flag("default", 'D', "Resetting iSCSI CHAP authenthication setting to default."),
};

}  // namespace

class AdapterAuthChapSet : public CommandFrame<AdapterAuthChapSet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Set the iSCSI CHAP authentication for the iSCSI Host Bus Adapter.",
      .type = kOperation,
      .parameters = kParameters,
      .result = Success(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override { SetChap(kAdapterLevel, input, output); }
};

template NodePtr Make<AdapterAuthChapSet>();

}  // namespace TessaroCli::IscsiNamespace
