/// What a survey says, as the lines of a screen.
#pragma once

#include <Plinth/Checks.h>

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

#include "status/Survey.h"

namespace TessaroCli::Status {

using Plinth::FindingState;

/// One line; texts are empty where there is nothing to tell.
struct Line {
  FindingState state = FindingState::Ok;
  std::string where = {};  ///< the adapter, or "host"
  const char* kind = "";   ///< what it is about, a word for scripts
  std::size_t count = 0;   ///< of what it is about
  std::string finding = {};
  std::string detail = {};
  std::string targets = {};
  std::string closer = {};  ///< the command line that shows more
};

/// The host as a whole first, then the rest, faults ahead of warnings ahead of what is well. @p surveys is
/// absent where the adapters cannot be listed, @p waiting what CheckSource::Waiting tells.
std::vector<Line> LinesOf(const std::optional<std::vector<AdapterSurvey>>& surveys,
                          const std::vector<Plinth::Finding>& waiting);

}  // namespace TessaroCli::Status
