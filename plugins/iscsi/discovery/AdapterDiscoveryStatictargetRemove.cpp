#include "discovery/AddressList.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {AdapterOption(), ListedTargetName(), ListedTarget()};

}  // namespace

class AdapterDiscoveryStatictargetRemove : public CommandFrame<AdapterDiscoveryStatictargetRemove> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Remove a static target",
      .type = kOperation,
      .options = kOptions,
      .result = SuccessResult(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    WithAdapter(input, output, ReportingReasonThen("Failed to remove static target."),
                [&](iScsiInterface& adapter) {
                  const auto address = IscsiTools::GetTargetAddressFromString(input->GetString("address"));
                  adapter.RemoveStaticTarget({input->GetString("name"), address});
                  PostSuccess(output);
                });
  }
};

template NodePtr Make<AdapterDiscoveryStatictargetRemove>();

}  // namespace TessaroCli::IscsiNamespace
