#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {
    AdapterOption(),
    StringOption("name", 'n', "The iSCSI initiator name."),
    StringOption("alias", 'a', "The iSCSI initiator alias."),
};

}  // namespace

class AdapterSet : public CommandFrame<AdapterSet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Set the iSCSI name and alias for the iSCSI Host Bus Adapter.",
      .type = kOperation,
      .options = kOptions,
      .result = SuccessResult(),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    const bool hasName = input->HasParameter("name");
    const bool hasAlias = input->HasParameter("alias");
    if (!hasName && !hasAlias) return output->ReportError(InvalidNameOrAliasMessage);
    if (hasName && input->GetString("name").empty()) return output->ReportError(InvalidNameMessage);

    WithAdapter(input, output, Reporting("Unable to set name or alias."), [&](iScsiInterface& adapter) {
      if (hasName) {
        IscsiTools::ProcessStatus(&adapter, adapter.SetInitiatorName(input->GetString("name")), output);
      }
      if (hasAlias) {
        IscsiTools::ProcessStatus(&adapter, adapter.SetInitiatorAlias(input->GetString("alias")), output);
      }
      PostSuccess(output);
    });
  }
};

template NodePtr Make<AdapterSet>();

}  // namespace TessaroCli::IscsiNamespace
