#include <algorithm>
#include <iterator>

#include "networkportal/ChangeSequence.h"

namespace TessaroCli::IscsiNamespace {
namespace {

constexpr Option kOptions[] = {
    AdapterOption(),
    StringOption("nic", 'n', "The iSCSI network portal (hostnic)"),
    BooleanOption("enable", 'e',
                  "Enable/Disable IPv4. All other options will be ignored if IPv4 is being disabled."),
    StringOption("ip", 'i', "The iSCSI network portal IPv4 address"),
    StringOption("subnet", 's', "The iSCSI network portal IPv4 subnet mask"),
    StringOption("gateway", 'g', "The iSCSI network portal IPv4 gateway address"),
    StringOption("dns1", 'x', "The iSCSI network portal primary DNS address"),
    StringOption("dns2", 'y', "The iSCSI network portal secondary DNS address"),
    BooleanOption(
        "enable-dhcpv4", 'd',
        "Enable/Disable IPv4 configuration using DHCPv4. If DHCPv4 is being enabled, static configuration "
        "parameters (ip,subnet,gateway,dns1,dns2) are ignored."),
};

constexpr const char* kStaticOptions[] = {"ip", "subnet", "gateway", "dns1", "dns2"};

bool SetIpv4(const Plinth::CallSpec::Input& input, iScsiInterface& adapter, ChangeSequence& sequence) {
  const auto given = [&](const char* option) { return input.HasParameter(option); };

  if (given("enable")) {
    const bool enable = input.GetBool("enable");
    sequence.Note("enable", adapter.SetIpVersionEnabled(4, enable));
    if (!enable) return true;
  }
  if (given("enable-dhcpv4")) {
    const bool enable = input.GetBool("enable-dhcpv4");
    sequence.Note("enable-dhcpv4", adapter.SetUseDhcpv4(enable));
    if (enable) return true;
  } else if (std::any_of(std::begin(kStaticOptions), std::end(kStaticOptions), given) &&
             adapter.GetNetworkProperties().useDhcpv4) {
    return sequence.Refuse("Cannot set static IPv4 configuration, as DHCPv4 is enabled for adapter " +
                           input.GetString("adapter") + ". You need to first disable DHCPv4.");
  }
  if (given("ip")) sequence.Note("ip", adapter.SetIpv4Address(input.GetString("ip")));
  if (given("subnet")) sequence.Note("subnet", adapter.SetIpv4SubnetMask(input.GetString("subnet")));
  if (given("gateway")) {
    const auto gateway = IscsiTools::GetIpv4AddressFromString(input.GetString("gateway"));
    sequence.Note("gateway", adapter.SetIpv4Gateway(gateway));
  }
  if (given("dns1") || given("dns2")) {
    const std::string primary = input.GetString("dns1");
    const std::string secondary = input.GetString("dns2");
    sequence.Note("dns", adapter.SetDnsServers(primary, secondary));
  }
  return true;
}

}  // namespace

class NetworkPortalIpconfigSet : public ChangeCommand<NetworkPortalIpconfigSet> {
 public:
  static constexpr Declaration kDeclaration =
      ChangeDeclaration("Set iSCSI network portal IPv4 configuration.", kOptions);
  static constexpr char kFailureText[] = "Failed to set IP configuration on network portal.";
  static constexpr ChangeSequence::Row kRow = SetIpv4;
};

template NodePtr Make<NetworkPortalIpconfigSet>();

}  // namespace TessaroCli::IscsiNamespace
