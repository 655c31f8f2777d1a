/// The adapters of the host, as the contract's interfaces.
///
/// The operations stand in one source file a family: identity, discovery, network, iSNS, CHAP and parameters.
#pragma once

#include <CoreCtl/Storage.h>

#include <map>

#include "corectl/Operation.h"
#include "host/Adapters.h"
#include "host/Pending.h"

namespace corectl {

using NodeCtl::Storage::ExtendedBool;
using NodeCtl::Storage::iScsiBoolParm;
using NodeCtl::Storage::iScsiCapabilities;
using NodeCtl::Storage::iScsiChapDirection;
using NodeCtl::Storage::iScsiChapParameters;
using NodeCtl::Storage::iScsiChapType;
using NodeCtl::Storage::iScsiDigestType;
using NodeCtl::Storage::iScsiIntegerParm;
using NodeCtl::Storage::iScsiLnpProperties;
using NodeCtl::Storage::iScsiNetworkPortalStatus;
using NodeCtl::Storage::iScsiNetworkProperties;
using NodeCtl::Storage::iScsiNicProperties;
using NodeCtl::Storage::iScsiParms;
using NodeCtl::Storage::iScsiPhysicalHbaProperties;
using NodeCtl::Storage::iScsiPnpProperties;
using NodeCtl::Storage::iScsiPortErrorCodes;
using NodeCtl::Storage::iSnsConfig;
using NodeCtl::Storage::iSnsDiscoveryMethod;
using NodeCtl::Storage::iSnsParms;
using NodeCtl::Storage::ScsiInterface;
using NodeCtl::Storage::StaticTarget;
using NodeCtl::Storage::TargetAddress;
namespace Network = NodeCtl::Network;

using host::Status;

#ifdef HCLI_CHECKED
/// How many interface objects were handed out and are not deleted yet. The libraries that are installed have
/// no such call.
__attribute__((visibility("default"))) std::size_t LiveInterfaces();
#endif

/// The name of one adapter, and how operations on it run. Each interface object has one.
class AdapterRef {
 public:
  explicit AdapterRef(std::string name);
  AdapterRef(const AdapterRef&) = delete;
  AdapterRef& operator=(const AdapterRef&) = delete;
  ~AdapterRef();
  const std::string& Name() const { return name_; }

  /// Runs @p body as the operation: it gets the tree and the adapter's object, of which it may change the
  /// copy.
  template <class Body>
  auto Read(host::Operation operation, std::initializer_list<host::Argument> arguments, Body body) const {
    return corectl::Read(host::Call::OnAdapter(operation, name_, arguments), OnAdapter(body));
  }
  template <class Body>
  auto Read(host::Operation operation, Body body) const {
    return Read(operation, {}, body);
  }
  template <class Body>
  auto Change(host::Operation operation, std::initializer_list<host::Argument> arguments, Body body) const {
    return corectl::Change(host::Call::OnAdapter(operation, name_, arguments), OnAdapter(body));
  }
  /// The text at @p path of the adapter's record, as the operation.
  std::string ReadText(host::Operation operation, const char* path) const;

 private:
  template <class Body>
  auto OnAdapter(Body& body) const {
    return [this, &body](host::Tree& tree) {
      host::Object adapter = Find(tree);
      return body(tree, adapter);
    };
  }
  /// The adapter's object; it may be gone since the interface was handed out.
  host::Object Find(host::Tree& tree) const;

  std::string name_;
  host::Reading reading_;  // what a command learns of the adapters it holds is of one moment
};

using host::IsIscsi;
using host::IsPresent;
using host::Setting;
/// Refuses what is no iSCSI name, and says why.
void RequireInitiatorName(const std::string& name);
/// Notes on a software adapter that the file with its name, as it is now, has had its turn. False where it
/// had before, and where there is no file.
bool HeedNameFile(host::Object& adapter);
/// Gives the adapter the name.
Status ConfigureName(host::Tree& tree, const host::Object& adapter, const std::string& name,
                     host::Effect effect);

/// A storage adapter without iSCSI.
class OtherAdapter final : public ScsiInterface {
 public:
  explicit OtherAdapter(std::string name) : ref_(std::move(name)) {}
  std::string GetName() override;
  std::string GetAdapterUid() override;
  std::string GetDriverName() override;

 private:
  AdapterRef ref_;
};

/// The parameters of places as a caller knows them: as they were last handed out to it, or stored by it.
using GivenParms = std::map<std::string, iScsiParms>;

/// An iSCSI adapter.
class Adapter final : public CoreCtl::Storage::iScsiInterfaceImpl {
 public:
  explicit Adapter(std::string name) : ref_(std::move(name)) {}
  std::string GetName() override;
  std::string GetAdapterUid() override;
  std::string GetDriverName() override;

  bool IsSoftwareOrDependent() override;
  void ResetAdapter() override;
  void Rediscover() override;
  iScsiDiscoveryStatus GetDiscoveryStatus() override;
  void GetNicProperties(iScsiNicProperties& nic, std::vector<iScsiNicProperties>& nics) override;
  void GetPhysicalNetworkPortals(std::vector<iScsiPnpProperties>& portals) override;
  void GetLogicalNetworkPortals(std::vector<iScsiLnpProperties>& portals) override;
  void BindHostnic(const std::string& nic, bool force) override;
  void UnbindHostnic(const std::string& nic, bool force) override;
  iScsiCapabilities GetCapabilities() override;
  iScsiPhysicalHbaProperties GetPhysicalHbaProperties() override;
  std::string GetInitiatorName() override;
  iScsiStatus SetInitiatorName(const std::string& name) override;
  std::string GetInitiatorAlias() override;
  iScsiStatus SetInitiatorAlias(const std::string& alias) override;
  void AddIsnsConfig(const iSnsConfig& config) override;
  void RemoveIsnsConfig(const iSnsConfig& config) override;
  std::vector<iSnsConfig*> GetIsnsConfigs() override;
  iSnsParms GetIsnsParms(const iSnsConfig& config) override;
  void SetIsnsParms(const iSnsConfig& config, const iSnsParms& parms) override;
  iSnsParms GetAdapterIsnsParms() override;
  iScsiStatus SetAdapterIsnsParms(const iSnsParms& parms) override;
  void AddStaticTarget(StaticTarget target) override;
  void RemoveStaticTarget(StaticTarget target) override;
  std::vector<StaticTarget*> GetStaticTargets() override;
  void AddSendTargetAddress(TargetAddress address) override;
  void RemoveSendTargetAddress(TargetAddress address) override;
  std::vector<TargetAddress*> GetSendTargetAddresses() override;
  iScsiNetworkProperties GetNetworkProperties() override;
  iScsiStatus SetIpv4Address(const std::string& address) override;
  iScsiStatus SetIpv4SubnetMask(const std::string& mask) override;
  iScsiStatus SetIpv4Gateway(const Network::Ipv4Address& gateway) override;
  iScsiStatus SetIpv6Gateway(const std::string& gateway) override;
  iScsiStatus SetDnsServers(const std::string& primary, const std::string& secondary) override;
  iScsiStatus SetIpv6Address(const std::string& address, int prefixLength, bool add) override;
  iScsiStatus SetIpv6ConfigMethod(const int& method, bool enable) override;
  iScsiStatus SetUseDhcpv4(bool enable) override;
  iScsiStatus SetIpVersionEnabled(int version, bool enable) override;
  iScsiAdapterState GetAdapterState() override;
  void SetChapParameters(iScsiChapParameters chap, int direction) override;
  void SetTargetChapParameters(StaticTarget target, iScsiChapParameters chap, int direction) override;
  void SetSendTargetChapParameters(TargetAddress address, iScsiChapParameters chap, int direction) override;
  void GetChapParameters(iScsiChapParameters& chap, int direction) override;
  void GetTargetChapParameters(StaticTarget target, iScsiChapParameters& chap, int direction) override;
  void GetSendTargetChapParameters(TargetAddress address, iScsiChapParameters& chap, int direction) override;
  iScsiStatus SetHeaderDigest(iScsiDigestType digest) override;
  iScsiStatus SetTargetHeaderDigest(StaticTarget target, iScsiDigestType digest) override;
  iScsiStatus SetSendTargetHeaderDigest(TargetAddress address, iScsiDigestType digest) override;
  iScsiDigestType GetHeaderDigest() override;
  iScsiDigestType GetTargetHeaderDigest(StaticTarget target) override;
  iScsiDigestType GetSendTargetHeaderDigest(TargetAddress address) override;
  iScsiStatus SetDataDigest(iScsiDigestType digest) override;
  iScsiStatus SetTargetDataDigest(StaticTarget target, iScsiDigestType digest) override;
  iScsiStatus SetSendTargetDataDigest(TargetAddress address, iScsiDigestType digest) override;
  iScsiDigestType GetDataDigest() override;
  iScsiDigestType GetTargetDataDigest(StaticTarget target) override;
  iScsiDigestType GetSendTargetDataDigest(TargetAddress address) override;
  iScsiStatus SetArpRedirect(bool enable) override;
  bool GetArpRedirect() override;
  iScsiStatus SetMtu(int mtu) override;
  int GetMtu() override;
  iScsiStatus SetAdapterParms(iScsiParms parms) override;
  iScsiParms GetAdapterParms() override;
  iScsiStatus SetTargetParms(StaticTarget target, iScsiParms parms) override;
  iScsiParms GetTargetParms(StaticTarget target) override;
  iScsiStatus SetSendTargetParms(TargetAddress address, iScsiParms parms) override;
  iScsiParms GetSendTargetParms(TargetAddress address) override;

 private:
  /// Runs a changing operation; the body returns Status.
  template <class Body>
  iScsiStatus ChangeWithStatus(host::Operation operation, std::initializer_list<host::Argument> arguments,
                               Body body) const {
    return static_cast<iScsiStatus>(ref_.Change(operation, arguments, body));
  }
  /// The same for a body that changes the configured record of the adapter itself, and may look at what is in
  /// effect. The change takes effect when changes of @p setting do.
  template <class Body>
  iScsiStatus Configure(host::Operation operation, std::initializer_list<host::Argument> arguments,
                        host::Setting setting, Body body) const {
    return ChangeWithStatus(operation, arguments, [&](host::Tree& tree, const host::Object& adapter) {
      host::Object configured = host::Configured(adapter);
      if constexpr (std::is_invocable_v<Body&, host::Object&, const host::Object&>) {
        body(configured, adapter);
      } else {
        body(configured);
      }
      return host::StoreConfigured(tree, adapter, configured.record, host::EffectOf(adapter.record, setting));
    });
  }

  AdapterRef ref_;
  GivenParms given_;
};

}  // namespace corectl
