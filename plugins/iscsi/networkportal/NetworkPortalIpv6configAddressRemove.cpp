#include "networkportal/AddressCheck.h"
#include "networkportal/ChangeSequence.h"

namespace TessaroCli::IscsiNamespace {
namespace {

using NodeCtl::Network::Ipv6Network;

constexpr Option kOptions[] = {
    AdapterOption(),
    AddressList(
        "An IPv6 address to remove in X:X:X::/X format. Multiple addresses can be provided using format "
        "-a address1 -a address2 -a address3.")
        .Required(),
};

constexpr AddressCheckTexts kTexts{
    .disabled = "Cannot remove IPv6 address as IPv6 is disabled for adapter ",
    .linkLocal =
        "Cannot remove link-local address as auto configuration of link-local address is enabled for "
        "adapter ",
    .routerAdvertisement = "Cannot remove IPv6 address as router advertisement is enabled for adapter ",
    .overLimit =
        [](unsigned count, int limit) {
          return "Number of routable addresses (" + std::to_string(count) + ")exceed maximum supported (" +
                 std::to_string(limit) + ")";
        },
};

bool RemoveAddresses(const Plinth::CallSpec::Input& input, iScsiInterface& adapter,
                     ChangeSequence& sequence) {
  const std::string adapterName = input.GetString("adapter");
  const auto network = adapter.GetNetworkProperties();
  AddressCheck check(network, adapterName, kTexts);
  if (const std::string fault = check.AdapterFault(); !fault.empty()) return sequence.Refuse(fault);
  if (const std::string fault = check.ListFault(input); !fault.empty()) return sequence.Refuse(fault);
  for (const Ipv6Network& address : check.GetAccepted()) {
    sequence.NoteUntilReset(
        adapter.SetIpv6Address(address.GetAddress().GetStringAddress(), address.GetNetmask(), false));
  }
  return true;
}

}  // namespace

class NetworkPortalIpv6configAddressRemove : public ChangeCommand<NetworkPortalIpv6configAddressRemove> {
 public:
  static constexpr Declaration kDeclaration =
      ChangeDeclaration("Remove IPv6 addresses from the given iSCSI network portal.", kOptions);
  static constexpr char kFailureText[] = "Error removing IPv6 address on network portal.";
  static constexpr ChangeSequence::Row kRow = RemoveAddresses;
};

template NodePtr Make<NetworkPortalIpv6configAddressRemove>();

}  // namespace TessaroCli::IscsiNamespace
