#include "discovery/AddressList.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Parameter kParameters[] = {Adapter(), ListedSendTarget()};

}  // namespace

class AdapterDiscoverySendtargetAdd : public CommandFrame<AdapterDiscoverySendtargetAdd> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Add a sendtarget address",
      .type = kOperation,
      .parameters = kParameters,
      .result = Success(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    if (input->GetString("address").empty()) return output->ReportError(InvalidAddressMessage);
    ChangeList(&iScsiInterface::AddSendTargetAddress, "Unable to add sendtarget address.", input, output);
  }
};

template NodePtr Make<AdapterDiscoverySendtargetAdd>();

}  // namespace TessaroCli::IscsiNamespace
