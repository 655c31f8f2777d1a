#include "IscsiUtil/Refusal.h"
#include "networkportal/AddressCheck.h"
#include "networkportal/ChangeSequence.h"
#include "networkportal/Ipv6Text.h"

namespace TessaroCli::IscsiNamespace {
namespace {

using NodeCtl::Network::Ipv6Network;

constexpr Option kOptions[] = {
    AdapterOption(),
    AddressList("An IPv6 address to add in X:X:X::/X format. Multiple addresses can be provided using format "
                "-a address1 -a address2 -a address3."),
    FlagOption(
        "remove-all-existing", 'r',
        "Remove all existing routable IPv6 addresses before adding the addresses specified by "
        "--address-list. If this flag is passed and --address-list is empty, all existing routable addresses "
        "are removed."),
};

constexpr AddressCheckTexts kTexts{
    .disabled = "Cannot add/remove IPv6 address as IPv6 is disabled for adapter ",
    .linkLocal =
        "Cannot add link-local address as auto configuration of link-local address is enabled for "
        "adapter ",
    .routerAdvertisement = "Cannot add IPv6 address as router advertisement is enabled for adapter ",
    .overLimit =
        [](unsigned, int limit) {
          return "Trying to add more routable addresses than supported (" + std::to_string(limit) + ").";
        },
};

/// Removes every routable address, wherever it came from.
void RemoveRoutable(const std::vector<Ipv6Network>& existing, iScsiInterface& adapter,
                    ChangeSequence& sequence) {
  for (const Ipv6Network& network : existing) {
    const std::string address = network.GetAddress().GetStringAddress();
    const std::optional<bool> linkLocal = IsLinkLocal(address);
    if (!linkLocal) {
      IscsiUtil::Refuse("Failed to remove the address. Invalid IPv6 address found: " + address,
                        "plugins/iscsi/networkportal");
    }
    if (!*linkLocal) sequence.NoteUntilReset(adapter.SetIpv6Address(address, network.GetNetmask(), false));
  }
}

bool AddAddresses(const Plinth::CallSpec::Input& input, iScsiInterface& adapter, ChangeSequence& sequence) {
  const bool removeExisting = input.HasParameter("remove-all-existing");
  if (!removeExisting && !input.HasParameter("address-list")) {
    return sequence.Refuse(
        "No command option specified. Either --address-list or --remove-all-existing must be specified.");
  }
  const std::string adapterName = input.GetString("adapter");
  const auto network = adapter.GetNetworkProperties();
  AddressCheck check(network, adapterName, kTexts);
  if (const std::string fault = check.AdapterFault(); !fault.empty()) return sequence.Refuse(fault);
  if (const std::string fault = check.ListFault(input); !fault.empty()) return sequence.Refuse(fault);
  if (removeExisting && network.useRouterAdvertisement) {
    return sequence.Refuse(
        "Cannot remove existing IPv6 addresses as router advertisement is enabled for adapter " +
        adapterName + ". You need to first disable router advertisement.");
  }
  // Up to here nothing has changed; from here on nothing is undone.
  if (removeExisting) RemoveRoutable(network.ipConfig.GetIpv6Network(), adapter, sequence);
  for (const Ipv6Network& address : check.GetAccepted()) {
    sequence.Note(
        "", adapter.SetIpv6Address(address.GetAddress().GetStringAddress(), address.GetNetmask(), true));
  }
  return true;
}

}  // namespace

class NetworkPortalIpv6configAddressAdd : public ChangeCommand<NetworkPortalIpv6configAddressAdd> {
 public:
  static constexpr Declaration kDeclaration =
      ChangeDeclaration("Add IPv6 addresses to the given iSCSI network portal.", kOptions);
  static constexpr char kFailureText[] = "Error adding IPv6 address list on network portal";
  static constexpr ChangeSequence::Row kRow = AddAddresses;
};

template NodePtr Make<NetworkPortalIpv6configAddressAdd>();

}  // namespace TessaroCli::IscsiNamespace
