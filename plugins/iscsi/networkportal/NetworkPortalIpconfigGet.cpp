#include "AdapterWalk.h"
#include "networkportal/Ipv6Text.h"

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
constexpr Structure kPortal = StructureOf<kColumns>("NetworkPortal");

constexpr Parameter kParameters[] = {
    Adapter(),
    String("nic", 'n', "The iSCSI network portal (hostnic)"),
};

/// The logical portal that the configuration is shown for: the one that the user named, whether or not it
/// exists, else the adapter's first.
std::string PortalName(const Plinth::CallSpec::Input& input, iScsiInterface& adapter) {
  const std::string nic = input.GetString("nic");
  const bool named = input.HasParameter("nic");
  try {
    std::vector<NodeCtl::Storage::iScsiLnpProperties> portals;
    adapter.GetLogicalNetworkPortals(portals);
    return named || portals.empty() ? nic : portals.front().name;
  } catch (const NodeCtl::Lib::NodeCtlException& failure) {
    if (!LacksCall<LnpListNotSupportedMessage>(adapter, failure)) throw;
    return "N/A";
  }
}

}  // namespace

class NetworkPortalIpconfigGet : public CommandFrame<NetworkPortalIpconfigGet> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "Get iSCSI network portal ipv4 configuration",
      .formatter = "simple",
      .formatterParameters = {Setting("header:NetworkPortal", "%IscsiAdapter%"),
                              FieldsFrom(1, "fields:NetworkPortal")},
      .parameters = kParameters,
      .result = ListOf(kPortal),
  };

  StructPtr GetListType() const { return NewPrototype(kPortal); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    WithAdapter(input, output,
                {"Failed to get IP configuration for network portal.", FailureReport::Reason::Last},
                [&](iScsiInterface& adapter) {
                  const auto network = adapter.GetNetworkProperties();
                  const std::string name = PortalName(*input, adapter);
                  const ListPtr list = NewList(kPortal);
                  list->Append(NewRow(kPortal, kColumns, {input->GetString("adapter"), name, network}));
                  Post(output, list);
                });
  }
};

template NodePtr Make<NetworkPortalIpconfigGet>();

}  // namespace TessaroCli::IscsiNamespace
