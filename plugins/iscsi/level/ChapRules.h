/// Reading and setting CHAP entries: what the commands of the three levels share.
#pragma once

#include <optional>
#include <string>

#include "level/Level.h"

namespace TessaroCli::IscsiNamespace {

using NodeCtl::Storage::ChapMutual;
using NodeCtl::Storage::ChapUni;
using NodeCtl::Storage::iScsiChapType;

// Options

inline constexpr const char* kChapDirections[] = {"uni", "mutual"};
inline constexpr const char* kChapLevels[] = {"prohibited", "discouraged", "preferred", "required"};

constexpr Option ChapDirection(const char* help) {
  return StringOption("direction", 'd', help).OneOf(kChapDirections);
}
constexpr Option ChapLevel(const char* help) { return StringOption("level", 'l', help).OneOf(kChapLevels); }

// Rows

/// What a row shows.
struct ShownChap {
  std::string place;  ///< the adapter as the user named it, or the address
  iScsiChapDirection direction;
  iScsiChapParameters entry;
  iScsiParms parms = {};    ///< inherit marks and parent, where the level has them
  std::string target = {};  ///< the name of the target, where the place is a portal of one
};

inline constexpr Column<ShownChap> kDirectionColumn = {
    "Direction", [](const ShownChap& shown) { return kChapDirections[shown.direction]; }};
inline constexpr Column<ShownChap> kNameColumn = {"Name",
                                                  [](const ShownChap& shown) { return shown.entry.name; }};
inline constexpr Column<ShownChap> kLevelColumn = {
    "Level", [](const ShownChap& shown) { return IscsiTools::GetStringFromChapType(shown.entry.level); }};
inline constexpr Column<ShownChap> kInheritanceColumn = {
    "Inheritance", [](const ShownChap& shown) {
      return shown.direction == ChapUni ? shown.parms.chapInherited : shown.parms.mutualChapInherited;
    }};
inline constexpr Column<ShownChap> kParentColumn = {
    "Parent", [](const ShownChap& shown) { return shown.parms.parent; }};

// Rules. Each reports what it refuses.

/// The direction that @p word names, uni where it is empty.
std::optional<iScsiChapDirection> ChapDirectionFrom(const std::string& word, const OutputPtr& output);
/// The entry that the options `default`, `authname`, `secret` and `level` describe.
std::optional<iScsiChapParameters> ChapEntryFrom(const InputPtr& input, const OutputPtr& output);
/// False where a mutual entry may not have @p level.
bool IsMutualLevel(iScsiChapType level, const OutputPtr& output);
/// False where a mutual entry of the level @p mutual may not stand over a uni entry of the level @p uni.
bool MayStandOver(iScsiChapType uni, iScsiChapType mutual, const OutputPtr& output);

/// The entry that stands where CHAP is off.
iScsiChapParameters ClearedChap();

/// Sets the CHAP entry of a level below the adapter's own, or its inheritance, as the options say. @p word
/// names the direction.
void SetInheritingChap(InheritingLevel& level, const std::string& word, const InputPtr& input,
                       const OutputPtr& output);

}  // namespace TessaroCli::IscsiNamespace
