#include <algorithm>
#include <iterator>

#include "networkportal/ChangeSequence.h"

namespace TessaroCli::IscsiNamespace {
namespace {

using NodeCtl::Storage::iScsiCapabilities;
using Input = Plinth::CallSpec::Input;
using Status = ChangeSequence::Status;

constexpr Option kOptions[] = {
    AdapterOption(),
    BooleanOption("enable", 'e', "Enable/Disable IPv6"),
    StringOption("gateway6", 'g', "The iSCSI network portal IPv6 gateway address"),
    BooleanOption("enable-dhcpv6", 'd', "Enable/Disable IPv6 configuration using DHCPv6"),
    BooleanOption("enable-linklocal-autoconfiguration", 'l',
                  "Enable/Disable auto configuration of linklocal address"),
    BooleanOption("enable-router-advertisement", 'r',
                  "Enable/Disable IPv6 configuration using Router Advertisement"),
};

/// One option: what the adapter must be able to set for it, and how it is set.
struct Change {
  const char* name;
  bool iScsiCapabilities::*settable;
  const char* refusal[2];  ///< what is said where it is not settable, around the adapter's name
  const char* reported;    ///< the name under which a reboot is asked for
  Status (*set)(iScsiInterface& adapter, const Input& input, const char* name);
};

template <int method>
Status SetMethod(iScsiInterface& adapter, const Input& input, const char* name) {
  return adapter.SetIpv6ConfigMethod(method, input.GetBool(name));
}

/// In the order in which they are handled.
constexpr Change kChanges[] = {
    {"enable",
     &iScsiCapabilities::ipv6EnableSettable,
     {"Enabling/Disabling IPv6 is not supported by adapter ", ". This parameter is not settable."},
     "enable",
     [](iScsiInterface& adapter, const Input& input, const char* name) {
       return adapter.SetIpVersionEnabled(6, input.GetBool(name));
     }},
    {"enable-dhcpv6",
     &iScsiCapabilities::ipv6DhcpConfigurationMethodSettable,
     {"DHCPv6 configuration mode is not settable for adapter ", "."},
     "enable-dhcpv6",
     SetMethod<iScsiInterface::Dhcpv6>},
    {"enable-linklocal-autoconfiguration",
     &iScsiCapabilities::ipv6LinkLocalAutoConfigurationMethodSettable,
     {"Link local auto configuration mode is not settable for adapter ", "."},
     "enable-linklocal-autoconfiguration",
     SetMethod<iScsiInterface::LinkLocalAutoConfiguration>},
    {"enable-router-advertisement",
     &iScsiCapabilities::ipv6RouterAdvertisementConfigurationMethodSettable,
     {"Router Advertisemnet configuration mode is not supported by adapter ", "."},
     "enable-router-advertisement",
     SetMethod<iScsiInterface::RouterAdvertisement>},
    {"gateway6",
     &iScsiCapabilities::ipv6DefaultGatewaySettable,
     {"IPv6 default gateway is not settable for adapter ", "."},
     "set-gateway6",
     [](iScsiInterface& adapter, const Input& input, const char* name) {
       return adapter.SetIpv6Gateway(input.GetString(name));
     }},
};

bool SetIpv6(const Input& input, iScsiInterface& adapter, ChangeSequence& sequence) {
  const auto given = [&](const Change& change) { return input.HasParameter(change.name); };
  if (std::none_of(std::begin(kChanges), std::end(kChanges), given)) return true;

  const std::string adapterName = input.GetString("adapter");
  const iScsiCapabilities capabilities = adapter.GetCapabilities();
  if (!capabilities.ipv6Supported) {
    return sequence.Refuse("IPv6 is not supported by adapter " + adapterName + ".");
  }
  for (const Change& change : kChanges) {
    if (!given(change)) continue;
    if (!(capabilities.*change.settable)) {
      return sequence.Refuse(change.refusal[0] + adapterName + change.refusal[1]);
    }
    sequence.Note(change.reported, change.set(adapter, input, change.name));
  }
  return true;
}

}  // namespace

class NetworkPortalIpv6configSet : public ChangeCommand<NetworkPortalIpv6configSet> {
 public:
  static constexpr Declaration kDeclaration =
      ChangeDeclaration("Set iSCSI network portal IPv6 configuration.", kOptions);
  static constexpr char kFailureText[] = "Failed to set IPv6 configuration on network portal.";
  static constexpr ChangeSequence::Row kRow = SetIpv6;
};

template NodePtr Make<NetworkPortalIpv6configSet>();

}  // namespace TessaroCli::IscsiNamespace
