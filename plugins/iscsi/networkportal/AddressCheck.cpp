#include "networkportal/AddressCheck.h"

#include "networkportal/Ipv6Text.h"

namespace TessaroCli::IscsiNamespace {

using NodeCtl::Network::Ipv6Network;

std::string AddressCheck::AdapterFault() const {
  if (!network_.ipv6Supported) return "IPv6 not supported by adapter " + adapterName_ + ".";
  if (!network_.ipv6Enabled) return texts_.disabled + adapterName_ + ". You need to first enable IPv6.";
  return {};
}

std::string AddressCheck::ListFault(const Plinth::CallSpec::Input& input) {
  std::vector<std::string> entries;
  if (input.HasParameter("address-list")) input.GetStringList("address-list", entries);
  for (const std::string& entry : entries) {
    if (std::string fault = EntryFault(entry); !fault.empty()) return fault;
  }
  return {};
}

std::string AddressCheck::EntryFault(const std::string& entry) {
  if (!Ipv6Network::IsValidAddressAndNetmask(entry)) {
    return "Address (" + entry +
           ") is not in valid format. Address must be in the format <ipv6-address>/<prefix-length>. "
           "Example: 1:2:3:4::/64.";
  }
  const Ipv6Network address(entry);
  if (network_.ipv6PrefixLength != -1 && address.GetNetmask() != network_.ipv6PrefixLength) {
    return "Invalid prefix length (" + std::to_string(address.GetNetmask()) +
           "). The adapter supports fixed prefix length (" + std::to_string(network_.ipv6PrefixLength) + ").";
  }
  const std::optional<bool> linkLocal = IsLinkLocal(address.GetAddress().GetStringAddress());
  if (!linkLocal) return "Invalid IPv6 address.";
  if (*linkLocal) {
    if (network_.useLinkLocalAutoConfiguration) {
      return texts_.linkLocal + adapterName_ + ". You need to first disable link-local autoconfiguration.";
    }
    if (linkLocalSeen_) {
      return "Multiple link-local addresses found. You should specify only one link-local address.";
    }
    linkLocalSeen_ = true;
  } else {
    if (network_.useRouterAdvertisement) {
      return texts_.routerAdvertisement + adapterName_ + ". You need to first disable router advertisement.";
    }
    // As unsigned numbers, so that -1 never limits.
    if (++routableCount_ > static_cast<unsigned>(network_.ipv6MaxStaticAddresses)) {
      return texts_.overLimit(routableCount_, network_.ipv6MaxStaticAddresses);
    }
  }
  accepted_.AddIpv6Network(address);
  return {};
}

}  // namespace TessaroCli::IscsiNamespace
