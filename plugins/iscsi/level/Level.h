/// The levels below an adapter's own: a sendtarget and a target portal, which keep session parameters and
/// CHAP entries of their own and may inherit each of them from their parent.
#pragma once

#include <string>
#include <utility>
#include <vector>

#include "CommandFrame.h"

namespace TessaroCli::IscsiNamespace {

using NodeCtl::Storage::iScsiCapabilities;
using NodeCtl::Storage::iScsiChapDirection;
using NodeCtl::Storage::iScsiChapParameters;
using NodeCtl::Storage::iScsiDigestType;
using NodeCtl::Storage::iScsiParms;
using NodeCtl::Storage::StaticTarget;
using NodeCtl::Storage::TargetAddress;

/// What the setting commands use of such a place. Lives no longer than its adapter object. Every operation is
/// one call of the library; the status of a store is not looked at.
class InheritingLevel {
 public:
  InheritingLevel() = default;
  InheritingLevel(const InheritingLevel&) = delete;
  InheritingLevel& operator=(const InheritingLevel&) = delete;
  virtual ~InheritingLevel() = default;

  virtual iScsiParms GetParms() = 0;
  virtual void SetParms(const iScsiParms& parms) = 0;
  virtual void SetHeaderDigest(iScsiDigestType digest) = 0;
  virtual void SetDataDigest(iScsiDigestType digest) = 0;
  virtual iScsiChapParameters GetChap(iScsiChapDirection direction) = 0;
  virtual void SetChap(const iScsiChapParameters& entry, iScsiChapDirection direction) = 0;
};

class SendTargetLevel final : public InheritingLevel {
 public:
  SendTargetLevel(iScsiInterface& adapter, TargetAddress address)
      : adapter_(adapter), address_(std::move(address)) {}

  iScsiParms GetParms() override { return adapter_.GetSendTargetParms(address_); }
  void SetParms(const iScsiParms& parms) override { adapter_.SetSendTargetParms(address_, parms); }
  void SetHeaderDigest(iScsiDigestType digest) override {
    adapter_.SetSendTargetHeaderDigest(address_, digest);
  }
  void SetDataDigest(iScsiDigestType digest) override { adapter_.SetSendTargetDataDigest(address_, digest); }
  iScsiChapParameters GetChap(iScsiChapDirection direction) override {
    iScsiChapParameters entry;
    adapter_.GetSendTargetChapParameters(address_, entry, direction);
    return entry;
  }
  void SetChap(const iScsiChapParameters& entry, iScsiChapDirection direction) override {
    adapter_.SetSendTargetChapParameters(address_, entry, direction);
  }

 private:
  iScsiInterface& adapter_;
  const TargetAddress address_;
};

class TargetPortalLevel final : public InheritingLevel {
 public:
  TargetPortalLevel(iScsiInterface& adapter, StaticTarget target)
      : adapter_(adapter), target_(std::move(target)) {}

  iScsiParms GetParms() override { return adapter_.GetTargetParms(target_); }
  void SetParms(const iScsiParms& parms) override { adapter_.SetTargetParms(target_, parms); }
  void SetHeaderDigest(iScsiDigestType digest) override { adapter_.SetTargetHeaderDigest(target_, digest); }
  void SetDataDigest(iScsiDigestType digest) override { adapter_.SetTargetDataDigest(target_, digest); }
  iScsiChapParameters GetChap(iScsiChapDirection direction) override {
    iScsiChapParameters entry;
    adapter_.GetTargetChapParameters(target_, entry, direction);
    return entry;
  }
  void SetChap(const iScsiChapParameters& entry, iScsiChapDirection direction) override {
    adapter_.SetTargetChapParameters(target_, entry, direction);
  }

 private:
  iScsiInterface& adapter_;
  const StaticTarget target_;
};

/// All static targets of the adapter where both texts are the word "all"; otherwise the one that they name.
std::vector<StaticTarget> TargetsNamed(iScsiInterface& adapter, const std::string& name,
                                       const std::string& address);

// Options by which the commands of a level name its place

constexpr Option SendTargetAddress() {
  return StringOption("address", 'a', "The iSCSI sendtarget address: <ip/dns[:port]>").Required();
}
constexpr Option TargetName() {
  return StringOption("name", 'n', "The iSCSI target name: <iqn/eui>").Required();
}
constexpr Option PortalAddress() {
  return StringOption("address", 'a', "The iSCSI target address: <ip/dns[:port]>").Required();
}

}  // namespace TessaroCli::IscsiNamespace
