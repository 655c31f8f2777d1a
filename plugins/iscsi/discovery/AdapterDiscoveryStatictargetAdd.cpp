#include "discovery/AddressList.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Parameter kParameters[] = {Adapter(), ListedTargetName(), ListedTarget()};

}  // namespace

class AdapterDiscoveryStatictargetAdd : public CommandFrame<AdapterDiscoveryStatictargetAdd> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Add a static target address",
      .type = kOperation,
      .parameters = kParameters,
      .result = Success(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    if (input->GetString("address").empty()) return output->ReportError(InvalidAddressMessage);
    if (input->GetString("name").empty()) return output->ReportError(InvalidNameMessage);
    ChangeList(&iScsiInterface::AddStaticTarget, "Failed to add static target.", input, output);
  }
};

template NodePtr Make<AdapterDiscoveryStatictargetAdd>();

}  // namespace TessaroCli::IscsiNamespace
