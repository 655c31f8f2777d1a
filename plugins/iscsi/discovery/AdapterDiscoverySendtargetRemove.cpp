#include "discovery/AddressList.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {AdapterOption(), ListedSendTarget()};

}  // namespace

class AdapterDiscoverySendtargetRemove : public CommandFrame<AdapterDiscoverySendtargetRemove> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Remove a sendtarget address",
      .type = kOperation,
      .options = kOptions,
      .result = SuccessResult(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    WithAdapter(input, output, ReportingReasonThen("Failed to remove sendtarget."),
                [&](iScsiInterface& adapter) {
                  adapter.RemoveSendTargetAddress(
                      IscsiTools::GetTargetAddressFromString(input->GetString("address")));
                  PostSuccess(output);
                });
  }
};

template NodePtr Make<AdapterDiscoverySendtargetRemove>();

}  // namespace TessaroCli::IscsiNamespace
