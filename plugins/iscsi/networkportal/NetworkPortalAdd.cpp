#include "networkportal/Binding.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {
    AdapterOption(),
    BoundHostnic(),
    BooleanOption(
        "force", 'f',
        "The force flag (force add of iSCSI hostnic even it's not compatible for iscsi multipathing)"),
};

}  // namespace

class NetworkPortalAdd : public CommandFrame<NetworkPortalAdd> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Add a network portal for iSCSI adapter",
      .type = kOperation,
      .options = kOptions,
      .result = SuccessResult(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    if (input->GetString("nic").empty()) return output->ReportError(InvalidNetworkPortalInputMessage);
    const auto adapter = FindAdapter(input, output);
    if (!adapter) return;
    bool force = false;
    try {
      if (input->HasParameter("force")) force = input->GetBool("force");
      adapter->BindHostnic(input->GetString("nic"), force);
      PostSuccess(output);
    } catch (const NodeCtl::Lib::NodeCtlException&) {
      output->ReportError("Unable to bind iscsi port. [force = " + std::to_string(force) + "]\n");
    }
  }
};

template NodePtr Make<NetworkPortalAdd>();

}  // namespace TessaroCli::IscsiNamespace
