#include "networkportal/Binding.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {
    AdapterOption(),
    BoundHostnic(),
    BooleanOption("force", 'f',
                  "The force flag (force removal of iSCSI hostnic when sessions are active using it)"),
};

}  // namespace

class NetworkPortalRemove : public CommandFrame<NetworkPortalRemove> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Remove a network portal for iSCSI adapter",
      .type = kOperation,
      .options = kOptions,
      .result = SuccessResult(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    if (input->GetString("nic").empty()) return output->ReportError(InvalidNetworkPortalInputMessage);
    WithAdapter(input, output, Reporting("Unable to unbind iscsi port."), [&](iScsiInterface& adapter) {
      bool force = false;
      if (input->HasParameter("force")) force = input->GetBool("force");
      adapter.UnbindHostnic(input->GetString("nic"), force);
      PostSuccess(output);
    });
  }
};

template NodePtr Make<NetworkPortalRemove>();

}  // namespace TessaroCli::IscsiNamespace
