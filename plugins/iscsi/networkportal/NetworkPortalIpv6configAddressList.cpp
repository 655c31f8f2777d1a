#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {
namespace {

using NodeCtl::Network::Ipv6AddressType;
using NodeCtl::Network::Ipv6Network;

std::string TypeText(Ipv6AddressType type) {
  switch (type) {
    case Ipv6AddressType::Static:
      return "STATIC";
    case Ipv6AddressType::Dhcp:
      return "DHCP";
    case Ipv6AddressType::AutoConf:
      return "AUTOCONF";
  }
  return "UNKNOWN";
}

constexpr Column<Ipv6Network> kColumns[] = {
    {"Address", [](const Ipv6Network& network) { return network.GetAddress().GetStringAddress(); }},
    {"IPv6PrefixLength", [](const Ipv6Network& network) { return network.GetNetmask(); }},
    {"Type", [](const Ipv6Network& network) { return TypeText(network.GetIpv6AddressType()); }},
};
constexpr auto kAddress = StructureOf<kColumns>("IPv6Address");

constexpr Option kOptions[] = {AdapterOption()};

}  // namespace

class NetworkPortalIpv6configAddressList : public CommandFrame<NetworkPortalIpv6configAddressList> {
 public:
  static constexpr Declaration kDeclaration{
      .description = "List the IPv6 addresses assigned to the iSCSI network portal.",
      .type = kFetcher,
      .formatter = "table",
      .formatterSettings = {FieldsFrom(0, kAddress, "fields:IPv6Address")},
      .options = kOptions,
      .result = ListResult(),
  };

  /// Virtual in this class alone: it has a place in its virtual table, behind those that are inherited.
  virtual StructPtr GetOutputStructure() { return NewPrototype(kAddress); }

 private:
  void ExecuteInternal(InputPtr input, OutputPtr output) override {
    WithAdapter(input, output, ReportingThenReason("Unable to list IPv6 Addresses."),
                [&](iScsiInterface& adapter) {
                  const ListPtr list = NewList(GetOutputStructure());
                  const auto properties = adapter.GetNetworkProperties();
                  for (const Ipv6Network& network : properties.ipConfig.GetIpv6Network()) {
                    list->Append(NewRow(kAddress, network));
                  }
                  Post(output, list);
                });
  }
};

template NodePtr Make<NetworkPortalIpv6configAddressList>();

}  // namespace TessaroCli::IscsiNamespace
