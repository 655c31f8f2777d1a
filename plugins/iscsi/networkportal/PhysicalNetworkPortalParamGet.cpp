#include "CommandFrame.h"
#include "IscsiUtil/ParmRows.h"

namespace TessaroCli::IscsiNamespace {
namespace {

using IscsiUtil::kNetParm;

constexpr Option kOptions[] = {
    AdapterOption(),
    StringOption("nic", 'n', "The physical network portal name: <phynic>"),
};

}  // namespace

class PhysicalNetworkPortalParamGet : public CommandFrame<PhysicalNetworkPortalParamGet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Get network parameters on a Physical Network Portal (phynic)",
      .type = kFetcher,
      .formatter = "table",
      .formatterSettings = {FieldsFrom(0, kNetParm, "fields:iScsiNetParm"),
                            Setting("header:iScsiNetParam", "%Phynic%")},
      .options = kOptions,
      .result = ListResult(),
  };

  StructPtr GetOutputStructure() const { return IscsiTools::NetParmStructure(); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    const auto adapter = FindAdapter(input, output);
    if (!adapter) return;
    std::string nic = input->GetString("nic");
    Guarded(output, Reporting("Failed to get parameters on physical network portal."), [&] {
      std::vector<NodeCtl::Storage::iScsiPnpProperties> portals;
      adapter->GetPhysicalNetworkPortals(portals);
      if (adapter->IsSoftwareOrDependent()) {
        return output->ReportError(
            "Physical Network Portal parameter get is not supported on software or dependent hardware iSCSI "
            "adapter.");
      }
      // The parameters are the adapter's: the name is a label and selects nothing.
      if (!input->HasParameter("nic") && !portals.empty()) nic = portals.front().name;
      const auto capabilities = adapter->GetCapabilities();
      const int mtu = adapter->GetMtu();
      const bool arpRedirect = adapter->GetArpRedirect();
      const ListPtr list = NewList(GetOutputStructure());
      IscsiTools::NetParmFill(nic, list, capabilities, mtu, arpRedirect);
      Post(output, list);
    });
  }
};

template NodePtr Make<PhysicalNetworkPortalParamGet>();

}  // namespace TessaroCli::IscsiNamespace
