/// The help that --help shows.
#pragma once

#include <cstddef>
#include <string>

#include "plinth/Page.h"

namespace Plinth {

/// The help on @p place for a screen of so many columns.
std::string HelpText(const Place& place, std::size_t columns);

/// @p line, which is for a shell, behind @p indent blanks, continued behind backslashes where it does not fit
/// into so many columns: the shell takes it for the same.
std::string WrappedLine(const std::string& line, std::size_t indent, std::size_t screen);

}  // namespace Plinth
