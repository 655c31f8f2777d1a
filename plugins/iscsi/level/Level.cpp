#include "level/Level.h"

#include <tuple>

#include "OwnedVector.h"

namespace TessaroCli::IscsiNamespace {
namespace {

using NodeCtl::Storage::StaticTarget;
using NodeCtl::Storage::TargetAddress;
using Status = iScsiInterface::iScsiStatus;

/// The operations of a level, of which each takes the key of the place first.
template <class... Key>
struct Operations {
  iScsiParms (iScsiInterface::*getParms)(Key...);
  Status (iScsiInterface::*setParms)(Key..., iScsiParms);
  iScsiDigestType (iScsiInterface::*getHeaderDigest)(Key...);
  iScsiDigestType (iScsiInterface::*getDataDigest)(Key...);
  Status (iScsiInterface::*setHeaderDigest)(Key..., iScsiDigestType);
  Status (iScsiInterface::*setDataDigest)(Key..., iScsiDigestType);
  void (iScsiInterface::*getChap)(Key..., iScsiChapParameters&, int);
  void (iScsiInterface::*setChap)(Key..., iScsiChapParameters, int);
};

constexpr Operations<> kAdapter = {&iScsiInterface::GetAdapterParms,   &iScsiInterface::SetAdapterParms,
                                   &iScsiInterface::GetHeaderDigest,   &iScsiInterface::GetDataDigest,
                                   &iScsiInterface::SetHeaderDigest,   &iScsiInterface::SetDataDigest,
                                   &iScsiInterface::GetChapParameters, &iScsiInterface::SetChapParameters};
constexpr Operations<TargetAddress> kSendTarget = {
    &iScsiInterface::GetSendTargetParms,          &iScsiInterface::SetSendTargetParms,
    &iScsiInterface::GetSendTargetHeaderDigest,   &iScsiInterface::GetSendTargetDataDigest,
    &iScsiInterface::SetSendTargetHeaderDigest,   &iScsiInterface::SetSendTargetDataDigest,
    &iScsiInterface::GetSendTargetChapParameters, &iScsiInterface::SetSendTargetChapParameters};
constexpr Operations<StaticTarget> kTarget = {
    &iScsiInterface::GetTargetParms,          &iScsiInterface::SetTargetParms,
    &iScsiInterface::GetTargetHeaderDigest,   &iScsiInterface::GetTargetDataDigest,
    &iScsiInterface::SetTargetHeaderDigest,   &iScsiInterface::SetTargetDataDigest,
    &iScsiInterface::GetTargetChapParameters, &iScsiInterface::SetTargetChapParameters};

template <class... Key>
class LevelOf : public Level {
 public:
  LevelOf(iScsiInterface& adapter, const Operations<Key...>& operations, Key... key)
      : adapter_(adapter), operations_(operations), key_(std::move(key)...) {}

  std::string Id() override { return IdOf(key_); }
  std::string TargetName() override {
    if constexpr (kIsTarget) return std::get<0>(key_).name;
    return {};
  }
  std::string Address() override { return AddressOf(key_); }

  iScsiParms GetParms() override { return Call(operations_.getParms); }
  Status SetParms(const iScsiParms& parms) override { return Call(operations_.setParms, parms); }
  iScsiDigestType GetDigest(Digest digest) override {
    return Call(digest == Digest::Header ? operations_.getHeaderDigest : operations_.getDataDigest);
  }
  Status SetDigest(Digest digest, iScsiDigestType value) override {
    return Call(digest == Digest::Header ? operations_.setHeaderDigest : operations_.setDataDigest, value);
  }
  iScsiChapParameters GetChap(iScsiChapDirection direction) override {
    iScsiChapParameters chap;
    Call(operations_.getChap, chap, direction);
    return chap;
  }
  void SetChap(const iScsiChapParameters& chap, iScsiChapDirection direction) override {
    Call(operations_.setChap, chap, direction);
  }

 private:
  static constexpr bool kIsTarget = (std::is_same_v<Key, StaticTarget> || ...);

  std::string IdOf(const std::tuple<>&) { return adapter_.GetName(); }
  template <class Place>
  std::string IdOf(const std::tuple<Place>& key) {
    return (kIsTarget ? TargetName() + ',' : "") + AddressOf(key);
  }

  static std::string AddressOf(const std::tuple<>&) { return {}; }
  static std::string AddressOf(const std::tuple<TargetAddress>& key) {
    return IscsiTools::GetStringFromTargetAddress(std::get<0>(key));
  }
  static std::string AddressOf(const std::tuple<StaticTarget>& key) {
    return IscsiTools::GetStringFromTargetAddress(std::get<0>(key).address);
  }

  template <class Operation, class... Arguments>
  auto Call(Operation operation, Arguments&&... arguments) {
    return std::apply([&](const Key&... key) { return (adapter_.*operation)(key..., arguments...); }, key_);
  }

  iScsiInterface& adapter_;
  const Operations<Key...>& operations_;
  std::tuple<Key...> key_;
};

LevelPtr MakeTarget(iScsiInterface& adapter, const StaticTarget& target) {
  return std::make_unique<LevelOf<StaticTarget>>(adapter, kTarget, target);
}

LevelPtr FindAdapterLevel(iScsiInterface& adapter, const Plinth::CallSpec::Input&) {
  return std::make_unique<LevelOf<>>(adapter, kAdapter);
}

LevelPtr FindSendTarget(iScsiInterface& adapter, const Plinth::CallSpec::Input& input) {
  return std::make_unique<LevelOf<TargetAddress>>(
      adapter, kSendTarget, IscsiTools::GetTargetAddressFromString(input.GetString("address")));
}

LevelPtr FindTarget(iScsiInterface& adapter, const Plinth::CallSpec::Input& input) {
  return MakeTarget(
      adapter, {input.GetString("name"), IscsiTools::GetTargetAddressFromString(input.GetString("address"))});
}

template <auto find>
std::vector<LevelPtr> SelectOne(iScsiInterface& adapter, const Plinth::CallSpec::Input& input) {
  std::vector<LevelPtr> levels;
  levels.push_back(find(adapter, input));
  return levels;
}

/// All static targets where both name and address are the word "all"; otherwise the one that they name.
std::vector<LevelPtr> SelectTargets(iScsiInterface& adapter, const Plinth::CallSpec::Input& input) {
  if (input.GetString("name") != "all" || input.GetString("address") != "all") {
    return SelectOne<FindTarget>(adapter, input);
  }
  std::vector<LevelPtr> levels;
  const OwnedVector<StaticTarget> targets(adapter.GetStaticTargets());
  for (const StaticTarget* target : targets) levels.push_back(MakeTarget(adapter, *target));
  return levels;
}

constexpr char kOneOption[] = "Only one options value, inherit, default can be used at once.";

}  // namespace

constinit const LevelKind kAdapterLevel = {
    .find = FindAdapterLevel,
    .select = SelectOne<FindAdapterLevel>,
    .inherits = false,
    .headerDigestSettable = &iScsiCapabilities::adapterHeaderDigestSupported,
    .dataDigestSettable = &iScsiCapabilities::adapterDataDigestSupported,
    .optionsMessage = "The value and default options cannot be used together.",
    .digestFirst = true,
    .statusShown = true,
    .hasMethod = false,
    .recordFirst = false,
    .chapGetFailure = "Failed to get iSCSI CHAP authentication configuration.",
    .chapSetFailure = "Failed to set iSCSI CHAP authentication configuration.",
};

constinit const LevelKind kSendTargetLevel = {
    .find = FindSendTarget,
    .select = SelectOne<FindSendTarget>,
    .inherits = true,
    .headerDigestSettable = &iScsiCapabilities::targetLevelHeaderDigestSupported,
    .dataDigestSettable = &iScsiCapabilities::targetLevelDataDigestSupported,
    .optionsMessage = kOneOption,
    .digestFirst = false,
    .statusShown = false,
    .hasMethod = false,
    .recordFirst = true,
    .chapGetFailure = "Failed to get iSCSI CHAP authentication configuration.",
    .chapSetFailure = "Failed to set CHAP authentication configuration.",
};

constinit const LevelKind kTargetLevel = {
    .find = FindTarget,
    .select = SelectTargets,
    .inherits = true,
    .headerDigestSettable = &iScsiCapabilities::targetLevelHeaderDigestSupported,
    .dataDigestSettable = &iScsiCapabilities::targetLevelDataDigestSupported,
    .optionsMessage = kOneOption,
    .digestFirst = false,
    .statusShown = false,
    .hasMethod = true,
    .recordFirst = false,
    .chapGetFailure = "Failed to get CHAP authentication configuration.",
    .chapSetFailure = "Unable to set CHAP authentication.",
};

}  // namespace TessaroCli::IscsiNamespace
