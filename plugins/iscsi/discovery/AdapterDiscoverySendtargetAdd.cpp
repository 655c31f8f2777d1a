#include "discovery/AddressList.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {AdapterOption(), ListedSendTarget()};

}  // namespace

class AdapterDiscoverySendtargetAdd : public CommandFrame<AdapterDiscoverySendtargetAdd> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Add a sendtarget address",
      .type = kOperation,
      .options = kOptions,
      .result = SuccessResult(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    if (input->GetString("address").empty()) return output->ReportError(InvalidAddressMessage);
    WithAdapter(
        input, output, ReportingReasonThen("Unable to add sendtarget address."),
        [&](iScsiInterface& adapter) {
          adapter.AddSendTargetAddress(IscsiTools::GetTargetAddressFromString(input->GetString("address")));
          PostSuccess(output);
        });
  }
};

template NodePtr Make<AdapterDiscoverySendtargetAdd>();

}  // namespace TessaroCli::IscsiNamespace
