/// Command lines that stand in a file.
#pragma once

#include <string>
#include <string_view>
#include <vector>

#pragma GCC visibility push(default)

namespace Plinth {

/// The words of @p line, quoted as in a POSIX shell: 'as it stands', "with \" and \\", a\ blank. Nothing is
/// expanded. "#" at the beginning of a word begins a comment. Throws UsageError for a quote that is not
/// closed, a backslash at the end, and a zero byte, which no argument of a program can have.
std::vector<std::string> SplitWords(std::string_view line);

}  // namespace Plinth

#pragma GCC visibility pop
