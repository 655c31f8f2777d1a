#include <cstdlib>
#include <variant>

#include "IscsiUtil/IscsiTools.h"
#include "IscsiUtil/ParmRows.h"
#include "IscsiUtil/Refusal.h"

namespace IscsiUtil {

using NodeCtl::Storage::iScsiBoolParm;
using NodeCtl::Storage::iScsiDigestType;
using NodeCtl::Storage::iScsiIntegerParm;
using NodeCtl::Storage::iScsiParms;
using NodeCtl::Storage::iSnsParms;
using TessaroCli::Column;
using TessaroCli::NewPrototype;
using TessaroCli::NewRow;
using TessaroCli::Structure;
using TessaroCli::StructureOf;

namespace {

// The table of session parameters

using P = iScsiParms;

/// A digest has no value in the record: it passes beside it.
enum class Digest { Header, Data };

/// A parameter: its key, and where its value and its inherit mark stand in the record.
struct Row {
  const char* key;
  std::variant<iScsiIntegerParm<std::int32_t> P::*, iScsiIntegerParm<std::int64_t> P::*, iScsiBoolParm P::*,
               Digest>
      value;
  bool P::*inherited;
};

constexpr Row kTable[] = {
    {"ErrorRecoveryLevel", &P::errorRecoveryLevel, &P::errorRecoveryLevelInherited},
    {"InitialLoginRetryMax", &P::initialLoginRetryMax, &P::initialLoginRetryMaxInherited},
    {"InitialR2T", &P::initialR2T, &P::initialR2TInherited},
    {"FirstBurstLength", &P::firstBurstLength, &P::firstBurstLengthInherited},
    {"MaxBurstLength", &P::maxBurstLength, &P::maxBurstLengthInherited},
    {"MaxRecvDataSegment", &P::maxRecvDataSegment, &P::maxRecvDataSegmentInherited},
    {"MaxOutstandingR2T", &P::maxOutstandingR2T, &P::maxOutstandingR2TInherited},
    {"MaxCmds", &P::maxCmds, &P::maxCmdsInherited},
    {"ImmediateData", &P::immediateData, &P::immediateDataInherited},
    {"DefaultTime2Retain", &P::defaultTime2Retain, &P::defaultTime2RetainInherited},
    {"DefaultTime2Wait", &P::defaultTime2Wait, &P::defaultTime2WaitInherited},
    {"LoginTimeout", &P::loginTimeout, &P::loginTimeoutInherited},
    {"LogoutTimeout", &P::logoutTimeout, &P::logoutTimeoutInherited},
    {"NoopOutInterval", &P::noopOutInterval, &P::noopOutIntervalInherited},
    {"NoopOutTimeout", &P::noopOutTimeout, &P::noopOutTimeoutInherited},
    {"RecoveryTimeout", &P::recoveryTimeout, &P::recoveryTimeoutInherited},
    {"DelayedAck", &P::delayedAck, &P::delayedAckInherited},
    {"HeaderDigest", Digest::Header, &P::headerDigestInherited},
    {"DataDigest", Digest::Data, &P::dataDigestInherited},
};

constexpr char kUnknownKey[] = "Invalid parameter key";

const Row& RowOf(const std::string& key) {
  for (const Row& row : kTable) {
    if (key == row.key) return row;
  }
  Refuse(kUnknownKey);
}

void RequirePollInterval(const std::string& key) {
  if (key != "PollInterval") Refuse(kUnknownKey);
}

/// One function for each kind of value. The one that takes any place serves the numbers of both widths.
template <class... Functions>
struct ByKind : Functions... {
  using Functions::operator()...;
};
template <class... Functions>
ByKind(Functions...) -> ByKind<Functions...>;

// All numbers are handled in 32 bits: of wider ones, the low half.

std::int32_t LowHalf(std::int64_t number) { return static_cast<std::int32_t>(number); }

void SetLowHalf(std::int32_t& number, std::int32_t half) { number = half; }
void SetLowHalf(std::int64_t& number, std::int32_t half) {
  const auto high = static_cast<std::uint64_t>(number) & 0xffffffff00000000u;
  number = static_cast<std::int64_t>(high | static_cast<std::uint32_t>(half));
}

// The words of the command line

/// What strtol makes of @p text: no digits are 0, and nothing is said of what stands behind them.
std::int32_t NumberFrom(const std::string& text) { return LowHalf(std::strtol(text.c_str(), nullptr, 10)); }

bool TruthFrom(const std::string& text) {
  for (const char* word : {"yes", "y", "true", "1"}) {
    if (text == word) return true;
  }
  for (const char* word : {"no", "n", "false", "0"}) {
    if (text == word) return false;
  }
  Refuse("Invalid data type for bool parameter expected one of [0, 1, y, n, true, false, yes, no]");
}

// The rows of a listing

constexpr char kNone[] = "na";

struct Shown {
  std::string id;
  const char* key = nullptr;
  std::string current = kNone;
  std::string defaultValue = kNone;
  std::string min = kNone;
  std::string max = kNone;
  bool settable = false;
  bool inherited = false;
};

const char* TruthText(bool truth) { return truth ? "true" : "false"; }

constexpr Column<Shown> kColumns[] = {
    {"ID", [](const Shown& shown) { return shown.id; }},
    {"Name", [](const Shown& shown) { return shown.key; }},
    {"Current", [](const Shown& shown) { return shown.current; }},
    {"Default", [](const Shown& shown) { return shown.defaultValue; }},
    {"Min", [](const Shown& shown) { return shown.min; }},
    {"Max", [](const Shown& shown) { return shown.max; }},
    {"Settable", [](const Shown& shown) { return shown.settable; }},
    {"Inherit", [](const Shown& shown) { return shown.inherited; }},
};
constexpr auto kShown = StructureOf<kColumns>("iScsiParm");

}  // namespace

constinit const Structure kParm = static_cast<const Structure&>(kShown);  // without its columns

boost::shared_ptr<Plinth::MetaObj::MetaStruct> IscsiTools::ParmStructure() { return NewPrototype(kParm); }

void IscsiTools::ParmFill(const std::string& id, const boost::shared_ptr<Plinth::MetaObj::MetaList>& list,
                          const iScsiParms& parms, iScsiDigestType headerDigest, iScsiDigestType dataDigest,
                          bool headerSettable, bool dataSettable) {
  for (const Row& row : kTable) {
    Shown shown;
    shown.id = id;
    shown.key = row.key;
    shown.inherited = parms.*row.inherited;
    const ByKind show = {
        [&](Digest digest) {
          shown.current = GetStringFromDigest(digest == Digest::Header ? headerDigest : dataDigest);
          shown.defaultValue = GetStringFromDigest(iScsiDigestType::Prohibited);
          shown.settable = digest == Digest::Header ? headerSettable : dataSettable;
        },
        [&](iScsiBoolParm P::*place) {
          const iScsiBoolParm& parm = parms.*place;
          if (!parm.valid) return;
          shown.current = TruthText(parm.current);
          shown.defaultValue = TruthText(parm.defaultValue);
          shown.settable = parm.settable;
        },
        [&](auto place) {
          const auto& parm = parms.*place;
          if (!parm.valid) return;
          shown.current = std::to_string(LowHalf(parm.current));
          shown.defaultValue = std::to_string(LowHalf(parm.defaultValue));
          shown.min = std::to_string(LowHalf(parm.min));
          shown.max = std::to_string(LowHalf(parm.max));
          shown.settable = parm.settable;
        },
    };
    std::visit(show, row.value);
    list->Append(NewRow(kShown, shown));
  }
}

bool IscsiTools::IsParmSettable(const std::string& key, const iScsiParms& parms, bool headerSettable,
                                bool dataSettable) {
  const ByKind isSettable = {
      [&](Digest digest) { return digest == Digest::Header ? headerSettable : dataSettable; },
      [&](auto place) { return (parms.*place).settable; },
  };
  return std::visit(isSettable, RowOf(key).value);
}

void IscsiTools::ParmSet(const std::string& key, const std::string& value, iScsiParms& parms) {
  const Row& row = RowOf(key);
  const ByKind set = {
      [](Digest) {},
      [&](iScsiBoolParm P::*place) { (parms.*place).current = TruthFrom(value); },
      [&](auto place) { SetLowHalf((parms.*place).current, NumberFrom(value)); },
  };
  std::visit(set, row.value);
  parms.*row.inherited = false;
}

void IscsiTools::ParmInherit(const std::string& key, iScsiParms& parms) {
  parms.*RowOf(key).inherited = true;
}

void IscsiTools::ParmDefault(const std::string& key, iScsiParms& parms) {
  const Row& row = RowOf(key);
  const ByKind setDefault = {
      [](Digest) {},
      [&](iScsiBoolParm P::*place) { (parms.*place).current = (parms.*place).defaultValue; },
      [&](auto place) { SetLowHalf((parms.*place).current, LowHalf((parms.*place).defaultValue)); },
  };
  std::visit(setDefault, row.value);
  parms.*row.inherited = false;
}

// The one parameter of iSNS discovery

bool IscsiTools::IsIsnsParmSettable(const std::string& key, const iSnsParms& parms) {
  RequirePollInterval(key);
  return parms.settable;
}

void IscsiTools::IsnsParmSet(const std::string& key, const std::string& value, iSnsParms& parms) {
  RequirePollInterval(key);
  parms.current = NumberFrom(value);
  parms.inherited = false;
}

void IscsiTools::IsnsParmInherit(const std::string& key, iSnsParms& parms) {
  RequirePollInterval(key);
  parms.inherited = true;
}

void IscsiTools::IsnsParmDefault(const std::string& key, iSnsParms& parms) {
  RequirePollInterval(key);
  parms.current = parms.defaultValue;
  parms.inherited = false;
}

}  // namespace IscsiUtil
