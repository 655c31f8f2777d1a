/// The rules that the IPv6 addresses of a command line must keep before any of them is added or removed.
#pragma once

#include <NodeCtl/Network.h>
#include <NodeCtl/Records.h>

#include <string>
#include <vector>

#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {

/// What adding and removing say in different words. The adapter's name goes behind the first three.
struct AddressCheckTexts {
  const char* disabled;
  const char* linkLocal;
  const char* routerAdvertisement;
  std::string (*overLimit)(unsigned count, int limit);
};

/// Checks addresses against the network configuration of one adapter, and collects those that pass.
class AddressCheck {
 public:
  using NetworkProperties = NodeCtl::Storage::iScsiNetworkProperties;

  /// @p adapterName is for the texts. All arguments live as long as this object.
  AddressCheck(const NetworkProperties& network, const std::string& adapterName,
               const AddressCheckTexts& texts)
      : network_(network), adapterName_(adapterName), texts_(texts) {}

  /// Why the adapter takes no address at all; empty when it does.
  std::string AdapterFault() const;
  /// Why the addresses of the option "address-list" are refused; empty when each of them passes.
  std::string ListFault(const Plinth::CallSpec::Input& input);
  /// The addresses that passed, in the order given.
  const std::vector<NodeCtl::Network::Ipv6Network>& GetAccepted() const { return accepted_.GetIpv6Network(); }

 private:
  std::string EntryFault(const std::string& entry);

  const NetworkProperties& network_;
  const std::string& adapterName_;
  const AddressCheckTexts& texts_;
  NodeCtl::Network::IpConfig accepted_;
  bool linkLocalSeen_ = false;
  unsigned routableCount_ = 0;
};

/// The option, of which the help @p help tells what becomes of the addresses.
constexpr Option AddressList(const char* help) { return StringListOption("address-list", 'a', help); }

}  // namespace TessaroCli::IscsiNamespace
