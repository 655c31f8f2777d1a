#pragma once

#include <string>

#include "plinth/CommandLine.h"

namespace Plinth {

inline constexpr char kOutOfMemory[] = "out of memory";

/// Says so on @p console, and takes no memory for it where the console takes none.
RunRecord OutOfMemory(Console& console);

/// Tells of the exception that is being handled: its text, or its type where it has none.
std::string CurrentExceptionText();

}  // namespace Plinth
