#include <CoreCtl/Util.h>

#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {
    BooleanOption("enabled", 'e', "Enable or disable the module.").Required(),
    StringOption("name", 'n',
                 "The iSCSI initiator name.\n"
                 "The initiator name must not be specified when disabling software iSCSI."),
};

/// Stores the name that the host's iSCSI daemon will use.
void StoreInitiatorName(const std::string& name) {
  CoreCtl::Storage::iScsiUtil::CheckInitiatorName(name);
  CoreCtl::Util::EnvironmentVarFile file("/etc/tessaro/coreiscsid/initiatorname.iscsi");
  file.Parse();
  file.Set("InitiatorName", name);
  file.Save();
}

}  // namespace

class SoftwareSet : public CommandFrame<SoftwareSet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Enable or disable software iSCSI.",
      .type = kOperation,
      .formatter = "simple",
      .options = kOptions,
      .result = TextResult("Status"),
  };

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    CoreCtl::Storage::StorageInfoImpl storage;
    const bool enable = input->GetBool("enabled");
    try {
      if (enable) {
        if (input->HasParameter("name")) StoreInitiatorName(input->GetString("name"));
        storage.EnableSoftwareiScsi(false);
        PostText(output, "Software iSCSI Enabled");
      } else {
        if (input->HasParameter("name")) {
          return output->ReportError("-n|--name must not be specified when disabling software iSCSI.");
        }
        storage.DisableSoftwareiScsi();
        PostText(output, "Software iSCSI Disabled. (Reboot Required)");
      }
    } catch (const NodeCtl::Lib::NodeCtlException& failure) {
      output->ReportError(std::string("Failed to ") + (enable ? "enable" : "disable") +
                          " software iSCSI: " + failure.GetDescription(0));
    }
  }
};

template NodePtr Make<SoftwareSet>();

}  // namespace TessaroCli::IscsiNamespace
