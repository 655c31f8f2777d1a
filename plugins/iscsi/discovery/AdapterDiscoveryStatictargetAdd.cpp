#include "discovery/AddressList.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {AdapterOption(), ListedTargetName(), ListedTarget()};

}  // namespace

class AdapterDiscoveryStatictargetAdd : public CommandFrame<AdapterDiscoveryStatictargetAdd> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Add a static target address",
      .type = kOperation,
      .options = kOptions,
      .result = SuccessResult(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    if (input->GetString("address").empty()) return output->ReportError(InvalidAddressMessage);
    if (input->GetString("name").empty()) return output->ReportError(InvalidNameMessage);
    WithAdapter(input, output, ReportingReasonThen("Failed to add static target."),
                [&](iScsiInterface& adapter) {
                  const auto address = IscsiTools::GetTargetAddressFromString(input->GetString("address"));
                  adapter.AddStaticTarget({input->GetString("name"), address});
                  PostSuccess(output);
                });
  }
};

template NodePtr Make<AdapterDiscoveryStatictargetAdd>();

}  // namespace TessaroCli::IscsiNamespace
