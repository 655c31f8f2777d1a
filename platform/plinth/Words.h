/// Command lines as people write them for a shell.
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

/// A command line that is still being written, up to the cursor.
struct OpenLine {
  /// The words that have ended, without their quotes. Redirections, with the files they lead to, are none.
  std::vector<std::string> words;
  /// The word at the cursor, without its quotes; empty behind a blank.
  std::string last;
  /// The same as it is written.
  std::string written;
  /// The quote that is open at the cursor, \' or "; 0 where none is.
  char quote = 0;
  /// The word at the cursor is the file of a redirection.
  bool isRedirection = false;
};

/// Reads what an interactive shell has, which is quoted as for SplitWords.
OpenLine ReadOpenLine(std::string_view line);

}  // namespace Plinth

#pragma GCC visibility pop
