/// Reading and setting the CHAP entries of a level.
#pragma once

#include "level/Level.h"

namespace TessaroCli::IscsiNamespace {

/// What a row shows.
struct ShownChap {
  std::string adapter;  ///< as the user named it
  Level& level;
  const char* direction;  ///< "uni" or "mutual"
  iScsiChapParameters chap;
  bool inherited;
  std::string parent;
};

// Columns that stand in the rows of several levels

inline constexpr Column<ShownChap> kDirectionColumn = {
    "Direction", [](const ShownChap& shown) { return shown.direction; }};
inline constexpr Column<ShownChap> kNameColumn = {"Name",
                                                  [](const ShownChap& shown) { return shown.chap.name; }};
inline constexpr Column<ShownChap> kLevelColumn = {
    "Level", [](const ShownChap& shown) { return IscsiTools::GetStringFromChapType(shown.chap.level); }};
inline constexpr Column<ShownChap> kInheritanceColumn = {
    "Inheritance", [](const ShownChap& shown) { return shown.inherited; }};
inline constexpr Column<ShownChap> kParentColumn = {"Parent",
                                                    [](const ShownChap& shown) { return shown.parent; }};

// Parameters

inline constexpr const char* kDirections[] = {"uni", "mutual"};
inline constexpr const char* kChapLevels[] = {"prohibited", "discouraged", "preferred", "required"};

constexpr Parameter ChapDirection(const char* help) {
  return String("direction", 'd', help).OneOf(kDirections);
}
constexpr Parameter ChapLevel(const char* help) { return String("level", 'l', help).OneOf(kChapLevels); }

template <const Structure& structure, const auto& columns>
StructPtr NewRowOf(const ShownChap& shown) {
  return NewRow(structure, columns, shown);
}

/// Posts a row, as @p row makes it, for each place that the options name.
void ShowChap(const LevelKind& kind, const Structure& structure, StructPtr (*row)(const ShownChap& shown),
              const InputPtr& input, const OutputPtr& output);
/// Sets an entry as the options say.
void SetChap(const LevelKind& kind, const InputPtr& input, const OutputPtr& output);

}  // namespace TessaroCli::IscsiNamespace
