#include "corectl/Level.h"

#include <algorithm>
#include <variant>

#include "host/Description.h"
#include "host/Formats.h"
#include "host/LevelSchema.h"
#include "host/Targets.h"

namespace corectl {

namespace {

using NodeCtl::Storage::ChapMutual;
using NodeCtl::Storage::ChapUni;
using NodeCtl::Storage::iScsiBoolParm;
using NodeCtl::Storage::iScsiChapType;
using NodeCtl::Storage::iScsiIntegerParm;

constexpr std::size_t kCount = std::size(host::kParameters);

/// Where a parameter stands in the contract's record.
struct Member {
  std::variant<iScsiIntegerParm<std::int32_t> iScsiParms::*, iScsiIntegerParm<std::int64_t> iScsiParms::*,
               iScsiBoolParm iScsiParms::*>
      value;
  bool iScsiParms::*inherited;
};

/// In the order of host::kParameters.
constexpr Member kMembers[kCount] = {
    {&iScsiParms::errorRecoveryLevel, &iScsiParms::errorRecoveryLevelInherited},
    {&iScsiParms::initialLoginRetryMax, &iScsiParms::initialLoginRetryMaxInherited},
    {&iScsiParms::initialR2T, &iScsiParms::initialR2TInherited},
    {&iScsiParms::firstBurstLength, &iScsiParms::firstBurstLengthInherited},
    {&iScsiParms::maxBurstLength, &iScsiParms::maxBurstLengthInherited},
    {&iScsiParms::maxRecvDataSegment, &iScsiParms::maxRecvDataSegmentInherited},
    {&iScsiParms::maxOutstandingR2T, &iScsiParms::maxOutstandingR2TInherited},
    {&iScsiParms::maxCmds, &iScsiParms::maxCmdsInherited},
    {&iScsiParms::immediateData, &iScsiParms::immediateDataInherited},
    {&iScsiParms::defaultTime2Retain, &iScsiParms::defaultTime2RetainInherited},
    {&iScsiParms::defaultTime2Wait, &iScsiParms::defaultTime2WaitInherited},
    {&iScsiParms::loginTimeout, &iScsiParms::loginTimeoutInherited},
    {&iScsiParms::logoutTimeout, &iScsiParms::logoutTimeoutInherited},
    {&iScsiParms::noopOutInterval, &iScsiParms::noopOutIntervalInherited},
    {&iScsiParms::noopOutTimeout, &iScsiParms::noopOutTimeoutInherited},
    {&iScsiParms::recoveryTimeout, &iScsiParms::recoveryTimeoutInherited},
    {&iScsiParms::delayedAck, &iScsiParms::delayedAckInherited},
};
static_assert(
    [] {
      for (std::size_t i = 0; i < kCount; ++i) {
        const host::ParameterSpec& spec = host::kParameters[i];
        if (kMembers[i].value.index() != (spec.type == host::Type::Boolean ? 2 : spec.isLong ? 1 : 0))
          return false;
      }
      return true;
    }(),
    "a parameter has another type in the contract's record");
/// In the order of host::kDigests.
constexpr bool iScsiParms::*kDigestMarks[] = {&iScsiParms::headerDigestInherited,
                                              &iScsiParms::dataDigestInherited};
/// In the order of host::kDirections.
constexpr bool iScsiParms::*kChapMarks[] = {&iScsiParms::chapInherited, &iScsiParms::mutualChapInherited};

std::int64_t CurrentOf(const iScsiParms& parms, const Member& member) {
  return std::visit([&](auto place) { return std::int64_t{(parms.*place).current}; }, member.value);
}

std::string DigestPath(Digest digest) {
  return host::PathOf("parameters", host::kDigests[static_cast<std::size_t>(digest)]);
}
/// Where the direction stands in host::kDirections.
std::size_t IndexOf(int direction) {
  if (direction == ChapUni || direction == ChapMutual) return static_cast<std::size_t>(direction);
  Deny(std::to_string(direction) + " is no direction of CHAP.");
}
std::string ChapPath(int direction) { return host::PathOf("chap", host::kDirections[IndexOf(direction)]); }

void SetValueAt(host::Record& record, const std::string& path, host::Type type, std::int64_t value) {
  if (type == host::Type::Boolean) {
    record.Set(path, value != 0);
  } else {
    record.Set(path, value);
  }
}

/// The contract counts levels from 1.
template <class Demand>
Demand NumberOf(host::Demand demand) {
  return static_cast<Demand>(static_cast<int>(demand) + 1);
}
template <class Demand>
std::string_view WordOf(Demand demand, const char* what) {
  const auto index = static_cast<std::size_t>(demand) - 1;
  if (index < std::size(host::kDemands)) return host::kDemands[index];
  Deny(std::to_string(static_cast<int>(demand)) + " is no level of " + what + ".");
}

}  // namespace

void RequireChapEntry(const std::string& name, const std::string& secret, const std::string& whose) {
  for (const std::string* text : {&name, &secret}) {
    std::string subject = whose + (text == &name ? " name" : " secret");
    const std::string fault = host::StorableFault(*text);
    if (!fault.empty()) Deny(subject.append(" ").append(fault).append("."));
    if (text->empty() || text->size() > 255) {
      Deny(subject + " has " + std::to_string(text->size()) + " bytes, and from 1 to 255 are allowed.");
    }
  }
  if (secret == host::kMask) Deny(whose + " secret is ***, which stands for a secret that is not shown.");
}

std::string PortalText(const std::string& host, std::int64_t port) {
  const bool isIpv6 = host.find(':') != host.npos;
  return (isIpv6 ? "[" + host + "]" : host) + ":" + std::to_string(port);
}

std::string PlaceText(const TargetAddress& address) {
  return PortalText(address.host.GetStringAddress(), address.port);
}
std::string PlaceText(const StaticTarget& target) { return target.name + "," + PlaceText(target.address); }

host::Record PlaceRecord(const TargetAddress& address) {
  host::Record record;
  record.Set("host", address.host.GetStringAddress());
  record.Set("port", int{address.port});
  return record;
}
host::Record PlaceRecord(const StaticTarget& target) {
  host::Record record = PlaceRecord(target.address);
  record.Set("name", target.name);
  return record;
}

Level::Level(host::Tree& tree, const host::Object& adapter) : tree_(tree), inEffect_(adapter) {
  Extend(adapter);
}

Level::Level(host::Tree& tree, const host::Object& adapter, const TargetAddress& address)
    : tree_(tree), inEffect_(FindPlace(tree, adapter, address)) {
  Extend(inEffect_);
  Extend(adapter);
}

Level::Level(host::Tree& tree, const host::Object& adapter, const StaticTarget& target)
    : tree_(tree), inEffect_(FindPlace(tree, adapter, target)) {
  Extend(inEffect_);
  if (const std::string name = host::ParentOf(Own()); !name.empty()) {
    if (const auto parent = tree.Find(adapter.id, host::Kind::SendTarget, name)) Extend(*parent);
  }
  Extend(adapter);
}

host::Inheritance Level::Holding() const {
  host::Inheritance levels;
  for (const host::Object& place : chain_) levels.push_back(&place.record);
  return levels;
}

std::string Level::ParentText() const {
  if (!HasParent()) return {};
  const host::Object& parent = chain_[1];
  if (parent.kind == host::Kind::Adapter) return parent.name;
  return PortalText(parent.record.GetString("host"), parent.record.GetInt64("port"));
}

void Level::RequireCapability(const char* own, const char* below, const std::string& subject) const {
  const std::string capability = HasParent() ? below : own;
  if (OfAdapter().GetBool(host::PathOf("capabilities", capability))) return;
  Deny(subject + ": the adapter lacks " + host::Quoted(capability) + ".");
}

void Level::Ensure(const std::string& path) {
  if (Own().Has(path)) return;
  Own().Set(path, host::Record());
  Own() = host::Complete(chain_.front().kind, Own());
}

Level::Parameter Level::GetParameter(std::size_t index) const {
  const host::ParameterSpec& spec = host::kParameters[index];
  const std::string path = host::PathOf("parameters", spec.name);
  const host::Record& adapter = OfAdapter();
  Parameter parameter{spec.value, spec.value, true, true, spec.least, spec.most, false};
  if (adapter.Has(path)) {
    parameter.standard = host::ValueAt(adapter, path + "/default", spec.type);
    parameter.settable = adapter.GetBool(path + "/settable");
    parameter.supported = adapter.GetBool(path + "/supported");
    if (spec.type == host::Type::Integer) {
      parameter.least = adapter.GetInt64(path + "/min");
      parameter.most = adapter.GetInt64(path + "/max");
    }
  }
  if (spec.name == "DelayedAck") parameter.settable &= adapter.GetBool("capabilities/Delayed Ack Settable");
  std::size_t depth = 0;
  parameter.current = host::ParameterAt(Holding(), index, &depth);
  parameter.inherited = depth > 0;
  return parameter;
}

iScsiParms Level::GetParms() const {
  iScsiParms parms;
  for (std::size_t i = 0; i < kCount; ++i) {
    const Parameter parameter = GetParameter(i);
    std::visit(
        [&](auto place) {
          auto& value = parms.*place;
          using Value = decltype(value.current);
          value.current = static_cast<Value>(parameter.current);
          value.defaultValue = static_cast<Value>(parameter.standard);
          if constexpr (!std::is_same_v<Value, bool>) {
            value.min = static_cast<Value>(parameter.least);
            value.max = static_cast<Value>(parameter.most);
          }
          value.settable = parameter.settable;
          value.valid = parameter.supported;
        },
        kMembers[i].value);
    parms.*kMembers[i].inherited = parameter.inherited;
  }
  parms.parent = ParentText();
  for (const Digest digest : {Digest::Header, Digest::Data}) {
    parms.*kDigestMarks[static_cast<int>(digest)] = HasParent() && !Own().Has(DigestPath(digest));
  }
  for (const int direction : {ChapUni, ChapMutual}) {
    parms.*kChapMarks[direction] = HasParent() && InheritsChap(ChapPath(direction));
  }
  return parms;
}

void Level::SetParameter(std::size_t index, std::int64_t value) {
  const Parameter parameter = GetParameter(index);
  const host::ParameterSpec& spec = host::kParameters[index];
  const std::string path = host::PathOf("parameters", spec.name);
  if (value != parameter.current) {
    const std::string subject = std::string(spec.name) + " cannot be set to " + std::to_string(value) + ": ";
    if (!parameter.supported) Deny(subject + "the adapter has no such parameter.");
    if (!parameter.settable) Deny(subject + "it is not settable.");
    if (value < parameter.least || value > parameter.most) {
      Deny(subject + "its range is from " + std::to_string(parameter.least) + " to " +
           std::to_string(parameter.most) + ".");
    }
  }
  if (HasParent()) {
    SetValueAt(Own(), path, spec.type, value);
  } else if (value == spec.value && !inEffect_.record.Has(path)) {
    Own().Erase(path);  // what waited has been taken back
  } else if (value != parameter.current) {
    Ensure(path);
    SetValueAt(Own(), path + "/current", spec.type, value);
  }
}

Status Level::SetParms(const iScsiParms& parms) {
  for (std::size_t i = 0; i < kCount; ++i) {
    if (HasParent() && parms.*kMembers[i].inherited) {
      Own().Erase(host::PathOf("parameters", host::kParameters[i].name));
    } else {
      SetParameter(i, CurrentOf(parms, kMembers[i]));
    }
  }
  if (HasParent()) {
    for (const Digest digest : {Digest::Header, Digest::Data}) {
      const std::string path = DigestPath(digest);
      if (parms.*kDigestMarks[static_cast<int>(digest)]) {
        Own().Erase(path);
      } else if (!Own().Has(path)) {
        Own().Set(path, WordOf(GetDigest(digest), "digests"));
      }
    }
    for (const int direction : {ChapUni, ChapMutual}) {
      MarkChap(direction, parms.*kChapMarks[direction]);
    }
  }
  const bool changed = Own().Text() != host::Configured(inEffect_).record.Text();
  // Where only digests wait, which have had their answer, a set that changes nothing asks for nothing.
  return changed || DoesParameterWait() ? StoreParameters() : Status::Success;
}

bool Level::DoesParameterWait() const {
  return std::any_of(std::begin(host::kParameters), std::end(host::kParameters), [this](const auto& spec) {
    return host::DoesWait(inEffect_, host::PathOf("parameters", spec.name));
  });
}

iScsiDigestType Level::GetDigest(Digest digest) const {
  return NumberOf<iScsiDigestType>(host::DigestAt(Holding(), static_cast<std::size_t>(digest)));
}

Status Level::SetDigest(Digest digest, iScsiDigestType value) {
  const std::string_view word = WordOf(value, "digests");
  if (value != iScsiDigestType::Prohibited) {
    const bool header = digest == Digest::Header;
    RequireCapability(
        header ? "Adapter Header Digest Supported" : "Adapter Data Digest Supported",
        header ? "Target Level Header Digest Supported" : "Target Level Data Digest Supported",
        (header ? "The header digest cannot be " : "The data digest cannot be ") + std::string(word));
  }
  const std::string path = DigestPath(digest);
  if (!HasParent() && value == iScsiDigestType::Prohibited && !inEffect_.record.Has(path)) {
    Own().Erase(path);  // it is what holds without one; what waited has been taken back
  } else {
    Own().Set(path, word);
  }
  return StoreParameters();
}

bool Level::InheritsChap(const std::string& path) const {
  return !Own().Has(path) || Own().GetBool(path + "/inherited");
}

void Level::MarkChap(int direction, bool inherited) {
  const std::string path = ChapPath(direction);
  if (InheritsChap(path) == inherited) return;
  if (!Own().Has(path)) {
    const host::ChapEntry holding = host::ChapAt(Holding(), IndexOf(direction));
    Ensure(path);
    SetEntry(path, holding.name, holding.secret, host::kDemands[static_cast<std::size_t>(holding.demand)]);
  }
  Own().Set(path + "/inherited", inherited);
}

void Level::SetEntry(const std::string& path, const std::string& name, const std::string& secret,
                     std::string_view level) {
  Own().Set(path + "/name", name);
  Own().Set(path + "/secret", secret);
  Own().Set(path + "/level", level);
}

void Level::GetChap(iScsiChapParameters& chap, int direction) const {
  const host::ChapEntry entry = host::ChapAt(Holding(), IndexOf(direction));
  chap.level = NumberOf<iScsiChapType>(entry.demand);
  chap.name = entry.name;
}

void Level::SetChap(const iScsiChapParameters& chap, int direction) {
  const std::string path = ChapPath(direction);
  const std::string_view word = WordOf(chap.level, "CHAP");
  if (chap.level != iScsiChapType::Prohibited) {
    const bool mutual = direction == ChapMutual;
    RequireCapability(
        mutual ? "Mutual Authentication Supported" : "CHAP Authorization Supported",
        mutual ? "Target Level Mutual Authentication Supported" : "Target Level Authentication Supported",
        (mutual ? "Mutual CHAP cannot be " : "CHAP cannot be ") + std::string(word));
    RequireChapEntry(chap.name, chap.secret, "The CHAP");
  }
  const bool inherits = HasParent() && InheritsChap(path);
  Ensure(path);
  if (HasParent()) Own().Set(path + "/inherited", inherits);
  SetEntry(path, chap.name, chap.secret, word);
  Store(host::Effect::Now);
}

host::Argument ShownParms(const iScsiParms& parms) {
  std::string text;
  const auto add = [&](std::string_view key, bool inherited, const std::string& value) {
    if (inherited || !value.empty()) {
      text += (text.empty() ? "{" : ", ") + std::string(key) + "=" + (inherited ? "inherited" : value);
    }
  };
  for (std::size_t i = 0; i < kCount; ++i) {
    const Member& member = kMembers[i];
    add(host::kParameters[i].name, parms.*member.inherited, std::to_string(CurrentOf(parms, member)));
  }
  for (std::size_t i = 0; i < std::size(host::kDigests); ++i)
    add(host::kDigests[i], parms.*kDigestMarks[i], "");
  add("CHAP", parms.chapInherited, "");
  add("mutual CHAP", parms.mutualChapInherited, "");
  return host::Argument::Plain(text + "}");
}

}  // namespace corectl
