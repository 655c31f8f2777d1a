#include "corectl/Level.h"

#include <algorithm>
#include <variant>

#include "host/Formats.h"
#include "host/LevelSchema.h"
#include "host/Targets.h"
#include "store/Document.h"

namespace corectl {

namespace {

using NodeCtl::Storage::ChapMutual;
using NodeCtl::Storage::ChapUni;
using NodeCtl::Storage::iScsiBoolParm;
using NodeCtl::Storage::iScsiChapType;
using NodeCtl::Storage::iScsiIntegerParm;

constexpr std::size_t kCount = std::size(host::kParameters);

/// Where a parameter stands in the contract's record.
struct Parm {
  std::string_view name;
  std::variant<iScsiIntegerParm<std::int32_t> iScsiParms::*, iScsiIntegerParm<std::int64_t> iScsiParms::*,
               iScsiBoolParm iScsiParms::*>
      value;
  bool iScsiParms::*inherited;
};

constexpr Parm kParms[] = {
    {"ErrorRecoveryLevel", &iScsiParms::errorRecoveryLevel, &iScsiParms::errorRecoveryLevelInherited},
    {"InitialLoginRetryMax", &iScsiParms::initialLoginRetryMax, &iScsiParms::initialLoginRetryMaxInherited},
    {"InitialR2T", &iScsiParms::initialR2T, &iScsiParms::initialR2TInherited},
    {"FirstBurstLength", &iScsiParms::firstBurstLength, &iScsiParms::firstBurstLengthInherited},
    {"MaxBurstLength", &iScsiParms::maxBurstLength, &iScsiParms::maxBurstLengthInherited},
    {"MaxRecvDataSegment", &iScsiParms::maxRecvDataSegment, &iScsiParms::maxRecvDataSegmentInherited},
    {"MaxOutstandingR2T", &iScsiParms::maxOutstandingR2T, &iScsiParms::maxOutstandingR2TInherited},
    {"MaxCmds", &iScsiParms::maxCmds, &iScsiParms::maxCmdsInherited},
    {"ImmediateData", &iScsiParms::immediateData, &iScsiParms::immediateDataInherited},
    {"DefaultTime2Retain", &iScsiParms::defaultTime2Retain, &iScsiParms::defaultTime2RetainInherited},
    {"DefaultTime2Wait", &iScsiParms::defaultTime2Wait, &iScsiParms::defaultTime2WaitInherited},
    {"LoginTimeout", &iScsiParms::loginTimeout, &iScsiParms::loginTimeoutInherited},
    {"LogoutTimeout", &iScsiParms::logoutTimeout, &iScsiParms::logoutTimeoutInherited},
    {"NoopOutInterval", &iScsiParms::noopOutInterval, &iScsiParms::noopOutIntervalInherited},
    {"NoopOutTimeout", &iScsiParms::noopOutTimeout, &iScsiParms::noopOutTimeoutInherited},
    {"RecoveryTimeout", &iScsiParms::recoveryTimeout, &iScsiParms::recoveryTimeoutInherited},
    {"DelayedAck", &iScsiParms::delayedAck, &iScsiParms::delayedAckInherited},
};
constexpr bool IsOf(const Parm& parm, const host::ParameterSpec& spec) {
  const bool isTruth = spec.type == host::Type::Boolean;
  return parm.name == spec.name && parm.value.index() == (isTruth ? 2u : spec.isLong ? 1u : 0u);
}
static_assert(std::ranges::equal(kParms, host::kParameters, IsOf),
              "the parameters of the host and those of the contract's record differ");

/// Where the record has the mark of what is no parameter in it.
struct Mark {
  std::string_view name;
  bool iScsiParms::*inherited;
};
constexpr Mark kDigestMarks[] = {{"HeaderDigest", &iScsiParms::headerDigestInherited},
                                 {"DataDigest", &iScsiParms::dataDigestInherited}};
constexpr Mark kChapMarks[] = {{"uni", &iScsiParms::chapInherited},
                               {"mutual", &iScsiParms::mutualChapInherited}};
static_assert(std::ranges::equal(kDigestMarks, host::kDigests, {}, &Mark::name));
static_assert(std::ranges::equal(kChapMarks, host::kDirections, {}, &Mark::name));

std::int64_t CurrentOf(const iScsiParms& parms, const Parm& parm) {
  return std::visit([&](auto place) { return std::int64_t{(parms.*place).current}; }, parm.value);
}

std::string DigestPath(Digest digest) {
  return host::PathOf("parameters", host::kDigests[static_cast<std::size_t>(digest)]);
}
/// Where the direction stands in host::kDirections.
std::size_t IndexOf(int direction) {
  if (direction == ChapUni || direction == ChapMutual) return static_cast<std::size_t>(direction);
  Deny(Why::Invalid, std::to_string(direction) + " is no direction of CHAP.");
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
  Deny(Why::Invalid, std::to_string(static_cast<int>(demand)) + " is no level of " + what + ".");
}

}  // namespace

void RequireChapEntry(const std::string& name, const std::string& secret, const std::string& whose) {
  for (const std::string* text : {&name, &secret}) {
    std::string subject = whose + (text == &name ? " name" : " secret");
    const std::string fault = host::StorableFault(*text);
    if (!fault.empty()) Deny(Why::Invalid, subject.append(" ").append(fault).append("."));
    if (text->empty() || text->size() > 255) {
      Deny(Why::OutOfRange,
           subject + " has " + std::to_string(text->size()) + " bytes, and from 1 to 255 are allowed.");
    }
  }
  if (secret == host::kMask)
    Deny(Why::Invalid, whose + " secret is ***, which stands for a secret that is not shown.");
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
  Deny(Why::NotSupported, subject + ": the adapter lacks " + host::Quoted(capability) + ".");
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
        kParms[i].value);
    parms.*kParms[i].inherited = parameter.inherited;
  }
  parms.parent = ParentText();
  for (const Digest digest : {Digest::Header, Digest::Data}) {
    parms.*kDigestMarks[static_cast<int>(digest)].inherited = HasParent() && !Own().Has(DigestPath(digest));
  }
  for (const int direction : {ChapUni, ChapMutual}) {
    parms.*kChapMarks[direction].inherited = HasParent() && InheritsChap(ChapPath(direction));
  }
  return parms;
}

void Level::SetParameter(std::size_t index, std::int64_t value) {
  const Parameter parameter = GetParameter(index);
  const host::ParameterSpec& spec = host::kParameters[index];
  const std::string path = host::PathOf("parameters", spec.name);
  if (value != parameter.current) {
    const std::string subject = std::string(spec.name) + " cannot be set to " + std::to_string(value) + ": ";
    if (!parameter.supported) Deny(Why::NotSupported, subject + "the adapter has no such parameter.");
    if (!parameter.settable) Deny(Why::NotSettable, subject + "it is not settable.");
    if (value < parameter.least || value > parameter.most) {
      Deny(Why::OutOfRange, subject + "its range is from " + std::to_string(parameter.least) + " to " +
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

Status Level::SetParms(const iScsiParms& parms, const iScsiParms& given) {
  // What a place sets itself; nothing where it inherits.
  const auto own = [this](const iScsiParms& record, const Parm& parm) -> std::optional<std::int64_t> {
    if (HasParent() && record.*parm.inherited) return {};
    return CurrentOf(record, parm);
  };
  for (std::size_t i = 0; i < kCount; ++i) {
    const std::optional<std::int64_t> value = own(parms, kParms[i]);
    if (value == own(given, kParms[i])) continue;
    if (value) {
      SetParameter(i, *value);
    } else {
      Own().Erase(host::PathOf("parameters", kParms[i].name));
    }
  }
  if (HasParent()) {
    const auto isChanged = [&](const Mark& mark) { return parms.*mark.inherited != given.*mark.inherited; };
    for (const Digest digest : {Digest::Header, Digest::Data}) {
      const Mark& mark = kDigestMarks[static_cast<int>(digest)];
      const std::string path = DigestPath(digest);
      if (!isChanged(mark)) continue;
      if (parms.*mark.inherited) {
        Own().Erase(path);
      } else if (!Own().Has(path)) {
        Own().Set(path, WordOf(GetDigest(digest), "digests"));
      }
    }
    for (const int direction : {ChapUni, ChapMutual}) {
      const Mark& mark = kChapMarks[direction];
      if (isChanged(mark)) MarkChap(direction, parms.*mark.inherited);
    }
  }
  const bool changed = Own() != host::Configured(inEffect_).record;
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
  if (!inherited) {
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
    if (mutual && host::ChapAt(Holding(), ChapUni).demand == host::Demand::Prohibited) {
      Deny(Why::WrongState, "Mutual CHAP cannot be " + std::string(word) + " while CHAP is prohibited.");
    }
  }
  const bool inherits = HasParent() && InheritsChap(path);
  Ensure(path);
  if (HasParent()) Own().Set(path + "/inherited", inherits);
  SetEntry(path, chap.name, chap.secret, word);
  const std::string mutualPath = ChapPath(ChapMutual);
  if (direction == ChapUni && chap.level == iScsiChapType::Prohibited && Own().Has(mutualPath)) {
    SetEntry(mutualPath, "none", "none", word);
  }
  Store(host::Effect::Now);
}

host::Argument ShownParms(const iScsiParms& parms) {
  std::string text;
  const auto add = [&](std::string_view key, bool inherited, const std::string& value) {
    if (inherited || !value.empty()) {
      text += (text.empty() ? "{" : ", ") + std::string(key) + "=" + (inherited ? "inherited" : value);
    }
  };
  for (const Parm& parm : kParms) {
    add(parm.name, parms.*parm.inherited, std::to_string(CurrentOf(parms, parm)));
  }
  for (const Mark& mark : kDigestMarks) add(mark.name, parms.*mark.inherited, "");
  add("CHAP", parms.chapInherited, "");
  add("mutual CHAP", parms.mutualChapInherited, "");
  return host::Argument::Plain(text + "}");
}

}  // namespace corectl
