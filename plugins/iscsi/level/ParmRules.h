/// Reading and setting parameters: what the commands of the three levels and those of iSNS share.
#pragma once

#include <initializer_list>
#include <string>

#include "IscsiUtil/ParmRows.h"
#include "level/Level.h"

namespace TessaroCli::IscsiNamespace {

using IscsiUtil::kParm;

/// The declaration of a command that shows the session parameters of a level.
constexpr Declaration ParmListing(const char* description, std::span<const Option> options) {
  return {
      .description = description,
      .type = kFetcher,
      .formatter = "table",
      .formatterSettings = {FieldsFrom(1, kParm, "fields:iScsiParm")},
      .options = options,
      .result = ListResult(),
  };
}

inline constexpr char kParmGetFailure[] = "Failed to get parameter configuration.";
inline constexpr char kParmSetFailure[] =
    "Unable to set parameters. Please make sure parameter input is settable and within MAX/MIN range "
    "(integer takes numbers, bool takes [true/false,yes/no,y/n]). Digests will take {prohibited, "
    "discouraged, preferred, required} only.";

inline constexpr char kValueOrDefaultMessage[] = "The value and default options cannot be used together.";
inline constexpr char kOnlyOneMessage[] = "Only one options value, inherit, default can be used at once.";

/// How many of the options @p names were given, with whatever value.
int CountGiven(const InputPtr& input, std::initializer_list<const char*> names);
/// Reports a `key` or a `value` that was given and is empty. False then.
bool KeyAndValueAreSound(const InputPtr& input, const OutputPtr& output);
/// What is reported of a parameter that cannot be changed.
std::string NotSettableText(const std::string& key);

/// Sets the session parameter @p key of a level below the adapter's own, as one of the options `value`,
/// `inherit` and `default` says.
void SetInheritingParm(InheritingLevel& level, const iScsiCapabilities& capabilities, const std::string& key,
                       const InputPtr& input, const OutputPtr& output);

}  // namespace TessaroCli::IscsiNamespace
