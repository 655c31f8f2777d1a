#include "IscsiUtil/Parameters.h"

#include <cstdlib>
#include <string_view>
#include <variant>

#include "IscsiUtil/IscsiTools.h"

namespace IscsiUtil {

using NodeCtl::Storage::iScsiBoolParm;
using NodeCtl::Storage::iScsiDigestType;
using NodeCtl::Storage::iScsiIntegerParm;
using NodeCtl::Storage::iScsiParms;
using NodeCtl::Storage::iSnsParms;
using TessaroCli::IscsiNamespace::Column;
using TessaroCli::IscsiNamespace::NewPrototype;
using TessaroCli::IscsiNamespace::NewRow;
using TessaroCli::IscsiNamespace::Structure;
using TessaroCli::IscsiNamespace::StructureOf;

namespace {

// Tables of parameters

enum class ParmType { Integer, Boolean, HeaderDigest, DataDigest };

/// The place of a value that passes beside the record.
using Beside = std::monostate;
/// The place of a value that is the record itself.
struct Whole {};

/// A parameter: its key, and where value and inherit mark stand in the record.
template <class Parms, class... Places>
struct ParmRow {
  const char* key;
  ParmType type;
  std::variant<Beside, Places...> value;
  bool Parms::*inherited;

  constexpr bool IsDigest() const { return type == ParmType::HeaderDigest || type == ParmType::DataDigest; }
};

using Row = ParmRow<iScsiParms, iScsiIntegerParm<std::int32_t> iScsiParms::*,
                    iScsiIntegerParm<std::int64_t> iScsiParms::*, iScsiBoolParm iScsiParms::*>;

using enum ParmType;
using P = iScsiParms;

constexpr Row kTable[] = {
    {"ErrorRecoveryLevel", Integer, &P::errorRecoveryLevel, &P::errorRecoveryLevelInherited},
    {"InitialLoginRetryMax", Integer, &P::initialLoginRetryMax, &P::initialLoginRetryMaxInherited},
    {"InitialR2T", Boolean, &P::initialR2T, &P::initialR2TInherited},
    {"FirstBurstLength", Integer, &P::firstBurstLength, &P::firstBurstLengthInherited},
    {"MaxBurstLength", Integer, &P::maxBurstLength, &P::maxBurstLengthInherited},
    {"MaxRecvDataSegment", Integer, &P::maxRecvDataSegment, &P::maxRecvDataSegmentInherited},
    {"MaxOutstandingR2T", Integer, &P::maxOutstandingR2T, &P::maxOutstandingR2TInherited},
    {"MaxCmds", Integer, &P::maxCmds, &P::maxCmdsInherited},
    {"ImmediateData", Boolean, &P::immediateData, &P::immediateDataInherited},
    {"DefaultTime2Retain", Integer, &P::defaultTime2Retain, &P::defaultTime2RetainInherited},
    {"DefaultTime2Wait", Integer, &P::defaultTime2Wait, &P::defaultTime2WaitInherited},
    {"LoginTimeout", Integer, &P::loginTimeout, &P::loginTimeoutInherited},
    {"LogoutTimeout", Integer, &P::logoutTimeout, &P::logoutTimeoutInherited},
    {"NoopOutInterval", Integer, &P::noopOutInterval, &P::noopOutIntervalInherited},
    {"NoopOutTimeout", Integer, &P::noopOutTimeout, &P::noopOutTimeoutInherited},
    {"RecoveryTimeout", Integer, &P::recoveryTimeout, &P::recoveryTimeoutInherited},
    {"DelayedAck", Boolean, &P::delayedAck, &P::delayedAckInherited},
    {"HeaderDigest", HeaderDigest, Beside(), &P::headerDigestInherited},
    {"DataDigest", DataDigest, Beside(), &P::dataDigestInherited},
};

constexpr ParmRow<iSnsParms, Whole> kIsnsTable[] = {
    {"PollInterval", Integer, Whole(), &iSnsParms::inherited},
};

template <class AnyRow, std::size_t count>
const AnyRow& RowOf(const AnyRow (&table)[count], const std::string& key) {
  for (const AnyRow& row : table) {
    if (key == row.key) return row;
  }
  IscsiTools::Refuse("Invalid parameter key");
}

template <class Parms, class Place>
auto& ValueAt(Parms& parms, Place place) {
  return parms.*place;
}
template <class Parms>
Parms& ValueAt(Parms& parms, Whole) {
  return parms;
}

/// Runs @p use on the value of the parameter in @p parms. False when it stands beside the record.
template <class AnyRow, class Parms, class Use>
bool WithValue(const AnyRow& row, Parms& parms, Use&& use) {
  return std::visit(
      [&](auto place) {
        if constexpr (std::is_same_v<decltype(place), Beside>) {
          return false;
        } else {
          use(ValueAt(parms, place));
          return true;
        }
      },
      row.value);
}

/// The same for a change, which ends the inheritance too.
template <class AnyRow, class Parms, class Use>
void ChangeValue(const AnyRow& row, Parms& parms, Use&& use) {
  if (!WithValue(row, parms, use) && !row.IsDigest()) IscsiTools::Refuse("Invalid parameter type");
  parms.*row.inherited = false;
}

// Values of one parameter. All numbers are handled in 32 bits: of wider ones, the low half.

std::int32_t LowHalf(std::int64_t number) { return static_cast<std::int32_t>(number); }

void SetLowHalf(std::int32_t& number, std::int32_t half) { number = half; }
void SetLowHalf(std::int64_t& number, std::int32_t half) {
  const auto high = static_cast<std::uint64_t>(number) & 0xffffffff00000000u;
  number = static_cast<std::int64_t>(high | static_cast<std::uint32_t>(half));
}

template <class Numeric>
void StoreValue(Numeric& parm, const std::string& text) {
  SetLowHalf(parm.current, LowHalf(std::strtol(text.c_str(), nullptr, 10)));
}

void StoreValue(iScsiBoolParm& parm, const std::string& text) {
  for (const char* word : {"yes", "y", "true", "1"}) {
    if (text == word) return static_cast<void>(parm.current = true);
  }
  for (const char* word : {"no", "n", "false", "0"}) {
    if (text == word) return static_cast<void>(parm.current = false);
  }
  IscsiTools::Refuse(
      "Invalid data type for bool parameter expected one of [0, 1, y, n, true, false, yes, no]");
}

template <class Numeric>
void StoreDefault(Numeric& parm) {
  SetLowHalf(parm.current, LowHalf(parm.defaultValue));
}

void StoreDefault(iScsiBoolParm& parm) { parm.current = parm.defaultValue; }

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

template <class Numeric>
void Show(Shown& shown, const Numeric& parm) {
  if (!parm.valid) return;
  shown.current = std::to_string(LowHalf(parm.current));
  shown.defaultValue = std::to_string(LowHalf(parm.defaultValue));
  shown.min = std::to_string(LowHalf(parm.min));
  shown.max = std::to_string(LowHalf(parm.max));
  shown.settable = parm.settable;
}

void Show(Shown& shown, const iScsiBoolParm& parm) {
  if (!parm.valid) return;
  shown.current = parm.current ? "true" : "false";
  shown.defaultValue = parm.defaultValue ? "true" : "false";
  shown.settable = parm.settable;
}

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

}  // namespace

constinit const Structure kParm = StructureOf<kColumns>("iScsiParm");

boost::shared_ptr<Plinth::MetaObj::MetaStruct> IscsiTools::ParmStructure() { return NewPrototype(kParm); }

void IscsiTools::ParmFill(const std::string& id, const boost::shared_ptr<Plinth::MetaObj::MetaList>& list,
                          const iScsiParms& parms, iScsiDigestType headerDigest, iScsiDigestType dataDigest,
                          bool headerSettable, bool dataSettable) {
  for (const Row& row : kTable) {
    Shown shown;
    shown.id = id;
    shown.key = row.key;
    shown.inherited = parms.*row.inherited;
    WithValue(row, parms, [&](const auto& parm) { Show(shown, parm); });
    if (row.IsDigest()) {
      const bool header = row.type == HeaderDigest;
      shown.current = GetStringFromDigest(header ? headerDigest : dataDigest);
      shown.defaultValue = GetStringFromDigest(iScsiDigestType::Prohibited);
      shown.settable = header ? headerSettable : dataSettable;
    }
    list->Append(NewRow(kParm, kColumns, shown));
  }
}

bool IscsiTools::IsParmSettable(const std::string& key, const iScsiParms& parms, bool headerSettable,
                                bool dataSettable) {
  const Row& row = RowOf(kTable, key);
  bool settable = false;
  if (row.type == HeaderDigest) settable = headerSettable;
  if (row.type == DataDigest) settable = dataSettable;
  WithValue(row, parms, [&](const auto& parm) { settable = parm.settable; });
  return settable;
}

void IscsiTools::ParmSet(const std::string& key, const std::string& value, iScsiParms& parms) {
  ChangeValue(RowOf(kTable, key), parms, [&](auto& parm) { StoreValue(parm, value); });
}

void IscsiTools::ParmInherit(const std::string& key, iScsiParms& parms) {
  parms.*RowOf(kTable, key).inherited = true;
}

void IscsiTools::ParmDefault(const std::string& key, iScsiParms& parms) {
  ChangeValue(RowOf(kTable, key), parms, [](auto& parm) { StoreDefault(parm); });
}

bool IscsiTools::IsIsnsParmSettable(const std::string& key, const iSnsParms& parms) {
  bool settable = false;
  WithValue(RowOf(kIsnsTable, key), parms, [&](const auto& parm) { settable = parm.settable; });
  return settable;
}

void IscsiTools::IsnsParmSet(const std::string& key, const std::string& value, iSnsParms& parms) {
  ChangeValue(RowOf(kIsnsTable, key), parms, [&](auto& parm) { StoreValue(parm, value); });
}

void IscsiTools::IsnsParmInherit(const std::string& key, iSnsParms& parms) {
  parms.*RowOf(kIsnsTable, key).inherited = true;
}

void IscsiTools::IsnsParmDefault(const std::string& key, iSnsParms& parms) {
  ChangeValue(RowOf(kIsnsTable, key), parms, [](auto& parm) { StoreDefault(parm); });
}

}  // namespace IscsiUtil
