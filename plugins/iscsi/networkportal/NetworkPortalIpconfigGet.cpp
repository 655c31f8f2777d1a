#include "networkportal/Ipv6Text.h"
#include "networkportal/MissingCall.h"

namespace TessaroCli::IscsiNamespace {
namespace {

struct Portal {
  std::string adapter;
  std::string name;
  NodeCtl::Storage::iScsiNetworkProperties network;
};

constexpr Column<Portal> kColumns[] = {
    {"IscsiAdapter", [](const Portal& portal) { return portal.adapter; }},
    {"Hostnic", [](const Portal& portal) { return portal.name; }},
    {"IPv4Enabled", [](const Portal& portal) { return portal.network.ipv4Enabled; }},
    {"IPv4",
     [](const Portal& portal) { return portal.network.ipConfig.GetIpv4Address().GetStringAddress(); }},
    {"IPv4SubnetMask",
     [](const Portal& portal) { return portal.network.ipConfig.GetIpv4Netmask().GetStringAddress(); }},
    {"IPv6", [](const Portal& portal) { return Ipv6Text(portal.network.ipConfig); }},
    {"UseDhcpv4", [](const Portal& portal) { return portal.network.useDhcpv4; }},
    {"Gateway", [](const Portal& portal) { return portal.network.gateway.GetStringAddress(); }},
    {"PrimaryDNS", [](const Portal& portal) { return portal.network.primaryDns; }},
    {"SecondaryDNS", [](const Portal& portal) { return portal.network.secondaryDns; }},
};
constexpr auto kPortal = StructureOf<kColumns>("NetworkPortal");

constexpr Option kOptions[] = {
    AdapterOption(),
    StringOption("nic", 'n', "The iSCSI network portal (hostnic)"),
};

/// The logical portal that the configuration is shown for: @p nic where the user @p named it, whether or not
/// it exists, else the adapter's first.
std::string PortalName(const std::string& nic, bool named, iScsiInterface& adapter) {
  try {
    std::vector<NodeCtl::Storage::iScsiLnpProperties> portals;
    adapter.GetLogicalNetworkPortals(portals);
    return named || portals.empty() ? nic : portals.front().name;
  } catch (const NodeCtl::Lib::NodeCtlException& failure) {
    if (!LacksLnpList(adapter, failure)) throw;
    return "N/A";
  }
}

}  // namespace

class NetworkPortalIpconfigGet : public CommandFrame<NetworkPortalIpconfigGet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Get iSCSI network portal ipv4 configuration",
      .formatter = "simple",
      .formatterSettings = {Setting("header:NetworkPortal", "%IscsiAdapter%"),
                            FieldsFrom(1, kPortal, "fields:NetworkPortal")},
      .options = kOptions,
      .result = ListResult(),
  };

  StructPtr GetListType() const { return NewPrototype(kPortal); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    WithAdapter(input, output, ReportingThenReason("Failed to get IP configuration for network portal."),
                [&](iScsiInterface& adapter) {
                  const std::string nic = input->GetString("nic");
                  const auto network = adapter.GetNetworkProperties();
                  const std::string name = PortalName(nic, input->HasParameter("nic"), adapter);
                  const ListPtr list = NewList(GetListType());
                  list->Append(NewRow(kPortal, {input->GetString("adapter"), name, network}));
                  Post(output, list);
                });
  }
};

template NodePtr Make<NetworkPortalIpconfigGet>();

}  // namespace TessaroCli::IscsiNamespace
