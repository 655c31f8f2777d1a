/// One iSCSI adapter.
///
/// An interface object is owned by the caller that was handed it and is a view of one adapter: it holds no
/// settings of its own, and each operation asks or changes the adapter at once. A changing operation that
/// returns has taken effect as its status says and is durable; one that throws has changed nothing. One
/// without a status takes effect at once.
///
/// Getters show what is in effect: what was set with RebootRequired or ResetRequired shows only after that.
/// The exceptions are session parameters, digests and PollInterval, which show what was set last, in effect
/// or not: front ends read the set, change one value and write all back, and must not undo what waits.
/// Setters judge by what was set last throughout, so that after SetUseDhcpv4(false) an address is taken,
/// whatever the status was.
///
/// Every operation may throw NodeCtl::Lib::NodeCtlException: the adapter is gone, the request is refused (the
/// text tells what was refused and why), or the library failed. An out parameter is then unchanged. Nothing
/// of another type is thrown but std::bad_alloc. Objects are not for use by several threads at once.
///
/// An adapter with a network stack of its own may lack two calls, and then throws one of these texts, whole
/// and to the letter, as front ends compare GetDescription(0) with them byte by byte:
///
///     iScsiLibException: status(80000001): Not supported; Message= IMA_TSR_GetLnpOidList
///     iScsiLibException: status(80000001): Not supported; Message= IMA_TSR_GetNicProperties
///
/// Where the text fits and IsSoftwareOrDependent is false, listings pass the adapter over. Any other text,
/// and these from a software or dependent adapter, fail the whole command.
///
/// Vectors of pointers are owned by the caller, elements included (CoreCtl::Util::DeleteVector). Secrets are
/// taken and never handed out.
#pragma once

#include <NodeCtl/Network.h>
#include <NodeCtl/Records.h>

#include <cstdint>
#include <string>
#include <vector>

#pragma GCC visibility push(default)

namespace NodeCtl::Storage {

/// Any storage adapter.
class ScsiInterface {
 public:
  ScsiInterface(const ScsiInterface&) = delete;
  ScsiInterface& operator=(const ScsiInterface&) = delete;
  virtual ~ScsiInterface();

  /// The name by which users and lookups know the adapter, unique on the host and compared exactly.
  virtual std::string GetName() = 0;
  /// An identifier that stays with the hardware, shown as it is; empty for none.
  virtual std::string GetAdapterUid() = 0;
  /// The name of the driver, shown as it is; empty where unknown.
  virtual std::string GetDriverName() = 0;

 protected:
  ScsiInterface() = default;
};

/// An iSCSI adapter.
class iScsiInterface : public virtual ScsiInterface {
 public:
  /// How a changing operation ended. Other numbers may occur and ask for nothing. A setter that takes back
  /// what waits, by setting what is in effect, returns Success.
  enum class iScsiStatus : std::int32_t {
    Success = 0,
    RebootRequired = 1,  ///< done; takes effect at the next reboot
    ResetRequired = 2,   ///< done; takes effect when ResetAdapter is called
    NotSupported = 4,    ///< this adapter has no such setting; nothing was changed
  };

  /// How the last discovery ended. Other numbers may occur and are shown as unknown.
  enum class iScsiDiscoveryStatus : std::int32_t {
    Completed = 0,                  ///< every sendtarget answered, and every login was let in
    Timeout = 1,                    ///< a sendtarget did not answer
    CompletedWithFailedLogins = 2,  ///< all answered, and a sendtarget or a target refused
  };

  /// Whether the adapter works: only one that is Online discovers and logs in. Other numbers may occur and
  /// are shown as unknown.
  enum class iScsiAdapterState : std::int32_t { Online = 0, Offline = 1, Unbound = 2 };

  /// How an IPv6 address is configured.
  enum iScsiIpv6ConfigMethod : int { LinkLocalAutoConfiguration = 1, Dhcpv6 = 2, RouterAdvertisement = 3 };

  ~iScsiInterface() override;

  /// True for a software adapter and for one that depends on the host's network stack; false for one with
  /// a network stack of its own.
  virtual bool IsSoftwareOrDependent() = 0;
  /// Resets the adapter, so that settings which asked for it take effect; what waits for a reboot waits on.
  /// Sessions end and come back by themselves. Front ends call it at most once a setter, or once behind a row
  /// of setters.
  virtual void ResetAdapter() = 0;

  /// Starts the discovery of targets from all configured addresses, and logs in to what is found. Refused on
  /// an adapter that is not online. Portals that keep silent and refused logins do not make it throw: the
  /// status tells of them.
  virtual void Rediscover() = 0;
  /// How the last discovery of this adapter ended; Completed where there was none yet.
  virtual iScsiDiscoveryStatus GetDiscoveryStatus() = 0;

  /// Completes @p nic, of which the name is set, and replaces the contents of @p nics by what the adapter
  /// knows of that NIC, a record each. The NIC is one of the host or a logical portal of the adapter; another
  /// name is refused. The adapter that cannot tell throws the text with IMA_TSR_GetNicProperties. Front ends
  /// ask for each entry of GetLogicalNetworkPortals and read complianceCode; there only the text with
  /// IMA_TSR_GetLnpOidList is passed over, so an adapter that lists logical portals must answer here.
  virtual void GetNicProperties(iScsiNicProperties& nic, std::vector<iScsiNicProperties>& nics) = 0;
  /// Replaces the contents of @p portals, in the adapter's order; none is no error. Listings pass over an
  /// adapter for which it throws, whatever the text.
  virtual void GetPhysicalNetworkPortals(std::vector<iScsiPnpProperties>& portals) = 0;
  /// Replaces the contents of @p portals, in the adapter's order; none is no error. Of a software or
  /// dependent adapter they are the NICs that are bound. The adapter that cannot tell throws the text with
  /// IMA_TSR_GetLnpOidList.
  virtual void GetLogicalNetworkPortals(std::vector<iScsiLnpProperties>& portals) = 0;
  /// Binds the host NIC @p nic, by its name. One that is not compliant is refused unless @p force is set; one
  /// that is unknown or bound to this adapter already is refused. An adapter with ports of its own takes
  /// none.
  virtual void BindHostnic(const std::string& nic, bool force) = 0;
  /// Unbinds the host NIC @p nic. One that active sessions use is refused unless @p force is set, which ends
  /// them; one that is not bound to this adapter is refused.
  virtual void UnbindHostnic(const std::string& nic, bool force) = 0;

  /// What the adapter can do. Every adapter answers; front ends ask before they call some setters, and leave
  /// the rest to the setters.
  virtual iScsiCapabilities GetCapabilities() = 0;
  /// What the adapter is made of. Every adapter answers; what is unknown is empty, 0 or Unknown.
  virtual iScsiPhysicalHbaProperties GetPhysicalHbaProperties() = 0;

  /// The iSCSI name of the adapter; empty for none.
  virtual std::string GetInitiatorName() = 0;
  /// @p name is an iSCSI name (RFC 7143 section 4.2.7), of at most 223 bytes of UTF-8; any other is refused,
  /// as is every one where nameAndAliasSettable is false.
  virtual iScsiStatus SetInitiatorName(const std::string& name) = 0;
  /// The alias of the adapter (RFC 7143 section 13.7); empty for none.
  virtual std::string GetInitiatorAlias() = 0;
  /// An empty @p alias clears it. At most 255 bytes (RFC 7143 section 13.7). A longer one is refused, as is
  /// every one where nameAndAliasSettable is false.
  virtual iScsiStatus SetInitiatorAlias(const std::string& alias) = 0;

  // iSNS servers (RFC 4171). Method and address together are the key of one; records stay the caller's.

  /// Adds the server @p config. Refused: one that is known already, a method other than Static, and any where
  /// iSnsSettable is false.
  virtual void AddIsnsConfig(const iSnsConfig& config) = 0;
  /// Removes the server @p config. One that is not known is refused, as is any where iSnsSettable is false.
  virtual void RemoveIsnsConfig(const iSnsConfig& config) = 0;
  /// The servers, of all methods, in the adapter's order. The caller deletes the elements; none is null.
  virtual std::vector<iSnsConfig*> GetIsnsConfigs() = 0;
  /// PollInterval of the server @p config, of any method: in seconds, that of the adapter where it is
  /// inherited. A server that is not known is refused.
  virtual iSnsParms GetIsnsParms(const iSnsConfig& config) = 0;
  /// Stores PollInterval of the server @p config. Of @p parms only inherited and current count, and current
  /// only where inherited is false; a changed value that is not settable or out of range is refused, as is a
  /// server that is not known.
  virtual void SetIsnsParms(const iSnsConfig& config, const iSnsParms& parms) = 0;
  /// PollInterval of the adapter in seconds. It has no parent and inherits nothing.
  virtual iSnsParms GetAdapterIsnsParms() = 0;
  /// Stores current of @p parms, as SetIsnsParms does, for the adapter.
  virtual iScsiStatus SetAdapterIsnsParms(const iSnsParms& parms) = 0;

  // Targets by address. Refused in a new one: no host, an IPv6 address where ipv6Supported is false, and a
  // host name where dnsBasedAddressSupported is false.

  /// Makes @p target known to the adapter; nothing is logged in to. One that was found by discovery is a
  /// static target besides from then on. One that is a static target already is refused, as is a name that is
  /// no iSCSI name (RFC 7143 section 4.2.7), and any where staticDiscoverySettable is false.
  virtual void AddStaticTarget(StaticTarget target) = 0;
  /// Removes @p target; its sessions stay. One that was found by discovery besides stays as that alone. One
  /// that is no static target is refused.
  virtual void RemoveStaticTarget(StaticTarget target) = 0;
  /// All target portals, static ones and those found by discovery, in the adapter's order: each is a key for
  /// the operations of target level. The caller deletes the elements; none is null.
  virtual std::vector<StaticTarget*> GetStaticTargets() = 0;
  /// Puts @p address on the list of sendtargets; nothing is discovered. One that is listed already is
  /// refused, as is any where sendTargetDiscoverySettable is false.
  virtual void AddSendTargetAddress(TargetAddress address) = 0;
  /// Takes @p address off the list; what was found through it stays. One that is not listed is refused.
  virtual void RemoveSendTargetAddress(TargetAddress address) = 0;
  /// The sendtargets, in the adapter's order. The caller deletes the elements; none is null.
  virtual std::vector<TargetAddress*> GetSendTargetAddresses() = 0;

  /// The network configuration, of every adapter, with IPv6 or without. IPv6 networks keep the adapter's
  /// order, those of DHCPv6 and router advertisements included.
  virtual iScsiNetworkProperties GetNetworkProperties() = 0;

  // Texts come as the user typed them, and what is malformed is refused here. Static IPv4 settings and DNS
  // servers are refused while DHCPv4 is on, IPv6 settings where ipv6Supported is false.

  /// @p address in dotted decimal, a unicast address.
  virtual iScsiStatus SetIpv4Address(const std::string& address) = 0;
  /// @p mask in dotted decimal: ones, then zeros. Needs subnetMaskSettable.
  virtual iScsiStatus SetIpv4SubnetMask(const std::string& mask) = 0;
  /// @p gateway lies in the subnet of address and mask; 0.0.0.0 clears it. Needs defaultGatewaySettable.
  virtual iScsiStatus SetIpv4Gateway(const Network::Ipv4Address& gateway) = 0;
  /// @p gateway as an IPv6 address; an empty text or "::" clears it. Needs ipv6DefaultGatewaySettable.
  virtual iScsiStatus SetIpv6Gateway(const std::string& gateway) = 0;
  /// Sets both servers, IPv4 or IPv6 addresses; an empty text clears one. One that changes needs
  /// primaryDnsSettable or secondaryDnsSettable.
  virtual iScsiStatus SetDnsServers(const std::string& primary, const std::string& secondary) = 0;
  /// Adds (@p add true) or removes the IPv6 address @p address with @p prefixLength bits of prefix, from 0 to
  /// 128. Needs ipv6Enabled. Not added are: what is no unicast address, one with another prefix length than
  /// the fixed one, one that the adapter has, a second link-local one, a link-local one while that is
  /// configured automatically, a routable one while those come from router advertisements, and one beyond
  /// ipv6MaxStaticAddresses. An address of any type can be removed, one that the adapter does not have with
  /// that prefix length is refused.
  virtual iScsiStatus SetIpv6Address(const std::string& address, int prefixLength, bool add) = 0;
  /// Switches @p method, one of iScsiIpv6ConfigMethod; another number is refused. Needs
  /// ipv6LinkLocalAutoConfigurationMethodSettable, ipv6DhcpConfigurationMethodSettable or
  /// ipv6RouterAdvertisementConfigurationMethodSettable. The methods do not exclude each other.
  virtual iScsiStatus SetIpv6ConfigMethod(const int& method, bool enable) = 0;
  /// Switches DHCPv4. Switched off, the adapter keeps the addresses that it has as static ones. Needs
  /// ipConfigurationMethodSettable.
  virtual iScsiStatus SetUseDhcpv4(bool enable) = 0;
  /// @p version is 4 or 6; another is refused. Needs ipv4EnableSettable or ipv6EnableSettable.
  virtual iScsiStatus SetIpVersionEnabled(int version, bool enable) = 0;

  /// Whether the adapter works now.
  virtual iScsiAdapterState GetAdapterState() = 0;

  // Three levels hold CHAP entries, digests and session parameters: the adapter, its sendtargets and its
  // target portals. What is not set at one of the lower levels it inherits: a target portal from the
  // sendtarget through which it was found, if any, and else from the adapter, as a sendtarget does. A
  // sendtarget or target portal that the adapter does not know is refused by all of the operations below.

  // CHAP entries (RFC 1994; RFC 7143 section 12.1.3). @p direction is one of iScsiChapDirection; another
  // number is refused. A level that the adapter does not support, or that is none, is refused. Name and
  // secret have from 1 to 255 bytes, unless the level is Prohibited. Front ends clear an entry with name
  // "none", secret "none" and that level. Setting an entry leaves it to the marks chapInherited and
  // mutualChapInherited of the session parameters whether it holds. Prohibiting CHAP clears the mutual entry
  // of the same place with it, and mutual CHAP is refused where CHAP is prohibited. A reading operation fills
  // in name and level, of the entry that holds after inheritance; all else of @p chap, the secret too, stays
  // as it came. Where none was ever set the name is "none" and the level Prohibited.
  virtual void SetChapParameters(iScsiChapParameters chap, int direction) = 0;
  virtual void SetTargetChapParameters(StaticTarget target, iScsiChapParameters chap, int direction) = 0;
  virtual void SetSendTargetChapParameters(TargetAddress address, iScsiChapParameters chap,
                                           int direction) = 0;
  virtual void GetChapParameters(iScsiChapParameters& chap, int direction) = 0;
  virtual void GetTargetChapParameters(StaticTarget target, iScsiChapParameters& chap, int direction) = 0;
  virtual void GetSendTargetChapParameters(TargetAddress address, iScsiChapParameters& chap,
                                           int direction) = 0;

  // Digest settings (RFC 7143 section 13.1). Getters show the one that holds after inheritance, Prohibited
  // where none was ever set. Setting one at target or sendtarget level ends its inheritance there;
  // SetTargetParms and SetSendTargetParms begin it again. A number that is none of the enumeration is
  // refused, and so is all but Prohibited where adapterHeaderDigestSupported or adapterDataDigestSupported,
  // below the adapter targetLevelHeaderDigestSupported or targetLevelDataDigestSupported, is false.
  virtual iScsiStatus SetHeaderDigest(iScsiDigestType digest) = 0;
  virtual iScsiStatus SetTargetHeaderDigest(StaticTarget target, iScsiDigestType digest) = 0;
  virtual iScsiStatus SetSendTargetHeaderDigest(TargetAddress address, iScsiDigestType digest) = 0;
  virtual iScsiDigestType GetHeaderDigest() = 0;
  virtual iScsiDigestType GetTargetHeaderDigest(StaticTarget target) = 0;
  virtual iScsiDigestType GetSendTargetHeaderDigest(TargetAddress address) = 0;
  virtual iScsiStatus SetDataDigest(iScsiDigestType digest) = 0;
  virtual iScsiStatus SetTargetDataDigest(StaticTarget target, iScsiDigestType digest) = 0;
  virtual iScsiStatus SetSendTargetDataDigest(TargetAddress address, iScsiDigestType digest) = 0;
  virtual iScsiDigestType GetDataDigest() = 0;
  virtual iScsiDigestType GetTargetDataDigest(StaticTarget target) = 0;
  virtual iScsiDigestType GetSendTargetDataDigest(TargetAddress address) = 0;

  /// Whether the adapter follows ARP redirects. Needs arpRedirectSettable.
  virtual iScsiStatus SetArpRedirect(bool enable) = 0;
  /// False too where the adapter has no such setting.
  virtual bool GetArpRedirect() = 0;
  /// @p mtu in bytes, within the range that the adapter takes; another is refused with a text that tells it.
  /// Needs mtuSettable. Front ends pass any number.
  virtual iScsiStatus SetMtu(int mtu) = 0;
  /// The MTU of the adapter in bytes.
  virtual int GetMtu() = 0;

  // Whole parameter sets. What is read can be written back; stored is what differs from what this object has
  // handed out or stored last, so that a change that somebody else has made in between stays. A value that is
  // changed to one out of its range, or where it is not settable, is refused with a text that tells key,
  // value and range. Only current values and marks of @p parms count. Below the adapter a value with its mark
  // of inheritance is not stored, and the parent's holds from then on; without the mark it is stored here. Of
  // digests and CHAP entries the marks alone pass, and CHAP ones always take effect at once. Clearing one of
  // CHAP makes the entry that was inherited the place's own, in the stead of any that it had, until another
  // is set. The adapter has no parent: its marks are false, and ignored.
  virtual iScsiStatus SetAdapterParms(iScsiParms parms) = 0;
  virtual iScsiParms GetAdapterParms() = 0;
  virtual iScsiStatus SetTargetParms(StaticTarget target, iScsiParms parms) = 0;
  virtual iScsiParms GetTargetParms(StaticTarget target) = 0;
  virtual iScsiStatus SetSendTargetParms(TargetAddress address, iScsiParms parms) = 0;
  virtual iScsiParms GetSendTargetParms(TargetAddress address) = 0;

 protected:
  iScsiInterface() = default;
};

}  // namespace NodeCtl::Storage

#pragma GCC visibility pop
