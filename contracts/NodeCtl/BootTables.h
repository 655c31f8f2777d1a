/// The iSCSI Boot Firmware Table of a host.
#pragma once

#include <cstdint>
#include <string>
#include <utility>

#pragma GCC visibility push(default)

namespace NodeCtl::Storage {

/// One boot table. Numbers and flags are those of the firmware's table, undecoded, and shown as they are.
/// Texts are UTF-8, empty for none. The two passwords travel in the record for the import of the table and
/// are never shown. Setters take any value.
class iScsiBootTable {
 public:
  iScsiBootTable() = default;
  iScsiBootTable(const iScsiBootTable&) = default;
  iScsiBootTable& operator=(const iScsiBootTable&) = default;
  virtual ~iScsiBootTable();

  /// Other than 0: the table holds.
  int GetEnabled() const { return enabled_; }
  void SetEnabled(int value) { enabled_ = value; }
  /// The flags of the NIC structure.
  int GetNicFlags() const { return nicFlags_; }
  void SetNicFlags(int value) { nicFlags_ = value; }
  /// The place of the NIC on the PCI bus: bus in bits 15 to 8, device in 7 to 3, function in 2 to 0.
  int GetNicPciBusDevFunc() const { return nicPciBusDevFunc_; }
  void SetNicPciBusDevFunc(int value) { nicPciBusDevFunc_ = value; }
  /// The MAC address of the NIC, as Network::MacAddress writes it.
  const std::string& GetMacAddress() const { return macAddress_; }
  void SetMacAddress(std::string value) { macAddress_ = std::move(value); }
  /// The IPv4 or IPv6 address of the NIC.
  const std::string& GetNicIP() const { return nicIP_; }
  void SetNicIP(std::string value) { nicIP_ = std::move(value); }
  /// The mask of that address in dotted decimal, or the length of its prefix.
  const std::string& GetNicSubnetMask() const { return nicSubnetMask_; }
  void SetNicSubnetMask(std::string value) { nicSubnetMask_ = std::move(value); }
  /// The gateway of the NIC, an address.
  const std::string& GetNicGateway() const { return nicGateway_; }
  void SetNicGateway(std::string value) { nicGateway_ = std::move(value); }
  /// Other than 0: the address of the NIC came from DHCP.
  int GetNicDhcp() const { return nicDhcp_; }
  void SetNicDhcp(int value) { nicDhcp_ = value; }
  /// The VLAN of the NIC, 1 to 4094 (IEEE 802.1Q); 0 for none.
  int GetNicVlan() const { return nicVlan_; }
  void SetNicVlan(int value) { nicVlan_ = value; }
  /// The flags of the target structure.
  int GetTargetBootFlags() const { return targetBootFlags_; }
  void SetTargetBootFlags(int value) { targetBootFlags_ = value; }
  /// The address of the target, IPv4 or IPv6; the import takes no name.
  const std::string& GetTargetIP() const { return targetIP_; }
  void SetTargetIP(std::string value) { targetIP_ = std::move(value); }
  /// The TCP port of the target, 0 to 65535.
  int GetTargetPort() const { return targetPort_; }
  void SetTargetPort(int value) { targetPort_ = value; }
  /// The logical unit to boot from, as a number of 64 bits.
  std::uint64_t GetLun() const { return lun_; }
  void SetLun(std::uint64_t value) { lun_ = value; }
  /// The iSCSI name of the target (RFC 7143 section 4.2.7).
  const std::string& GetTargetName() const { return targetName_; }
  void SetTargetName(std::string value) { targetName_ = std::move(value); }
  /// 0 none, 1 CHAP, 2 mutual CHAP; the import refuses another number.
  int GetChapType() const { return chapType_; }
  void SetChapType(int value) { chapType_ = value; }
  /// The CHAP name with which the initiator proves itself.
  const std::string& GetChapName() const { return chapName_; }
  void SetChapName(std::string value) { chapName_ = std::move(value); }
  /// The CHAP secret that goes with it.
  const std::string& GetChapPwd() const { return chapPwd_; }
  void SetChapPwd(std::string value) { chapPwd_ = std::move(value); }
  /// The CHAP name with which the target proves itself.
  const std::string& GetReverseChapName() const { return reverseChapName_; }
  void SetReverseChapName(std::string value) { reverseChapName_ = std::move(value); }
  /// The CHAP secret that goes with it.
  const std::string& GetReverseChapPwd() const { return reverseChapPwd_; }
  void SetReverseChapPwd(std::string value) { reverseChapPwd_ = std::move(value); }
  /// The flags of the initiator structure.
  int GetInitiatorBootFlags() const { return initiatorBootFlags_; }
  void SetInitiatorBootFlags(int value) { initiatorBootFlags_ = value; }
  /// The address of the SLP server.
  const std::string& GetSlpIP() const { return slpIP_; }
  void SetSlpIP(std::string value) { slpIP_ = std::move(value); }
  /// The iSCSI name that the firmware used.
  const std::string& GetInitiatorName() const { return initiatorName_; }
  void SetInitiatorName(std::string value) { initiatorName_ = std::move(value); }
  /// The alias that the firmware used.
  const std::string& GetInitiatorAlias() const { return initiatorAlias_; }
  void SetInitiatorAlias(std::string value) { initiatorAlias_ = std::move(value); }

 private:
  int enabled_ = 0;
  int nicFlags_ = 0;
  int nicPciBusDevFunc_ = 0;
  std::string macAddress_;
  std::string nicIP_;
  std::string nicSubnetMask_;
  std::string nicGateway_;
  int nicDhcp_ = 0;
  int nicVlan_ = 0;
  int targetBootFlags_ = 0;
  std::string targetIP_;
  int targetPort_ = 0;
  std::uint64_t lun_ = 0;
  std::string targetName_;
  int chapType_ = 0;
  std::string chapName_;
  std::string chapPwd_;
  std::string reverseChapName_;
  std::string reverseChapPwd_;
  int initiatorBootFlags_ = 0;
  std::string slpIP_;
  std::string initiatorName_;
  std::string initiatorAlias_;
};

/// The two boot tables of a host, by value. A table that the host does not have is all zeros and empty texts.
/// The primary one is shown and imported; the secondary one is not read by front ends.
class iScsiBootTables {
 public:
  iScsiBootTable GetPrimary() const { return primary_; }
  void SetPrimary(const iScsiBootTable& table) { primary_ = table; }
  iScsiBootTable GetSecondary() const { return secondary_; }
  void SetSecondary(const iScsiBootTable& table) { secondary_ = table; }

 private:
  iScsiBootTable primary_;
  iScsiBootTable secondary_;
};

}  // namespace NodeCtl::Storage

#pragma GCC visibility pop
