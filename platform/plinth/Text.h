/// Small tools for text: UTF-8, what a terminal may be shown, and words that resemble each other.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace Plinth {

/// One character of a text.
struct Character {
  char32_t code = 0;
  /// Bytes that it takes; 1 for a byte that begins no valid character.
  std::size_t length = 1;
  bool valid = false;
};

/// The character that begins at @p at, which must be below the size of @p text. Overlong forms, surrogates
/// and codes above U+10FFFF are not valid.
Character DecodeUtf8(std::string_view text, std::size_t at);

/// Whether Visible leaves newlines and tabs as they are.
enum class Lines { Escaped, Kept };

/// How many bytes at the front of @p text are printable ASCII, which every form of output shows as it is.
std::size_t PlainLength(std::string_view text);

/// @p text with control characters and invalid bytes written as "\n", "\t" or "\x1b", so that it can neither
/// break a line nor steer a terminal.
std::string Visible(std::string_view text, Lines lines = Lines::Escaped);

/// The visible text in double quotes, as messages name what the user wrote.
std::string Quoted(std::string_view text);

/// Columns that a visible text takes on a terminal. Depends on LC_CTYPE for characters outside ASCII.
std::size_t DisplayWidth(std::string_view visible);

/// @p visible with its middle left out, and a mark there, so that it takes at most @p width columns, which
/// are at least 1: of names, the end tells as much as the beginning.
std::string Shortened(std::string_view visible, std::size_t width);

/// @p text, made visible, with its own lines, each broken at blanks to fit behind @p indent blanks within @p
/// screen columns. The first line has no indent: something stands in front of it.
std::string Wrap(const std::string& text, std::size_t indent, std::size_t screen);

std::string Join(const std::vector<std::string>& parts, std::string_view separator);
std::vector<std::string> Split(std::string_view text, char separator);

/// The candidate nearest to @p word by edits and swaps, or "" where none is reasonably near; of several, the
/// first. The platform's libraries, which cannot know the framework, have a wider rule of their own.
std::string Nearest(std::string_view word, const std::vector<std::string>& candidates);

/// @p text with each %Name% replaced by what @p lookup gives; a %Name% that it does not know (it returns
/// false) stays as written.
template <class Lookup>
std::string Expand(std::string_view text, Lookup lookup) {
  std::string expanded;
  while (!text.empty()) {
    const std::size_t begin = text.find('%');
    const std::size_t end = begin == text.npos ? text.npos : text.find('%', begin + 1);
    if (end == text.npos) break;
    std::string value;
    expanded += text.substr(0, begin);
    if (lookup(text.substr(begin + 1, end - begin - 1), value)) {
      expanded += value;
      text.remove_prefix(end + 1);
    } else {
      // The second sign may begin the next name.
      expanded += text.substr(begin, end - begin);
      text.remove_prefix(end);
    }
  }
  return expanded.append(text);
}

}  // namespace Plinth
