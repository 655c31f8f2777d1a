/// Reading and setting the session parameters of a level.
#pragma once

#include "IscsiUtil/Parameters.h"
#include "level/Level.h"

namespace TessaroCli::IscsiNamespace {

using IscsiUtil::kParm;

/// The declaration of a command that shows the parameters of a level.
constexpr Declaration ParmListing(const char* description, std::span<const Parameter> parameters) {
  return {
      .description = description,
      .type = kFetcher,
      .formatter = "table",
      .formatterParameters = {FieldsFrom(1, "fields:iScsiParm")},
      .parameters = parameters,
      .result = ListOf(kParm),
  };
}

/// Posts the parameters of all places that the options name.
void ShowParms(const LevelKind& kind, const InputPtr& input, const OutputPtr& output);
/// Sets one parameter as the options `key`, and one of `value`, `inherit` and `default`, say.
void SetParm(const LevelKind& kind, const InputPtr& input, const OutputPtr& output);

}  // namespace TessaroCli::IscsiNamespace
