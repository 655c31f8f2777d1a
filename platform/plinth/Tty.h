/// What a person at a terminal gets, and programs do not: colour and a pager.
#pragma once

#include <string>
#include <vector>

namespace Plinth {

struct Run;

/// ECMA-48, "SGR": bold, red, and neither.
inline constexpr const char* kHeading = "\x1b[1m";
inline constexpr const char* kFailed = "\x1b[31m";
inline constexpr const char* kPlain = "\x1b[0m";

/// The values of --color.
std::vector<std::string> ColorWords();
/// TERM names a terminal that can do nothing, or none.
bool IsDumbTerminal();
/// Whether to colour a file that is a terminal or is not: as --color says, else where it is one and NO_COLOR
/// is empty (https://no-color.org).
bool IsColored(const Run& run, bool isTerminal);
/// @p help, visible already, with its headings in bold.
std::string WithHeadings(const std::string& help);

/// False where the result goes out as it comes: to no terminal, in a batch, or without a pager.
bool MayPage(const Run& run);
/// Writes @p text in the pager where the screen does not hold it, and to standard output else.
void WritePaged(const Run& run, const std::string& text);

}  // namespace Plinth
