/// The help that --help shows.
#pragma once

#include <cstddef>
#include <string>

#include "plinth/Page.h"

namespace Plinth {

/// The help on @p place for a screen of so many columns.
std::string HelpText(const Place& place, std::size_t columns);

}  // namespace Plinth
