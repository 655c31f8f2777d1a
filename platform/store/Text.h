/// Texts: character sets, and what messages show of what somebody wrote.
#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

#pragma GCC visibility push(default)

namespace store {

/// With small letters for the capital ones of ASCII, which are the same in the names of hosts.
std::string LowerCase(std::string_view text);
bool IsAscii(std::string_view text);
bool IsUtf8(std::string_view text);
/// What keeps a text out of a record, as "is not UTF-8"; empty when nothing does.
std::string StorableFault(std::string_view text);
/// UTF-8 to UTF-32; nothing for malformed input (RFC 3629).
std::optional<std::wstring> WideFromUtf8(std::string_view text);
/// UTF-32 to UTF-8; nothing for surrogates and numbers above 0x10ffff.
std::optional<std::string> Utf8FromWide(std::wstring_view text);

/// The text with control characters and bytes that are not UTF-8 as "\n" and "\x9b", so that it can neither
/// break a line nor work on a terminal.
std::string Printable(std::string_view text);
/// The same in double quotes, quotes and backslashes escaped: for messages and traces.
std::string Quoted(std::string_view text);
/// The same for what somebody wrote, of any length: of a long text only how it begins, and its size.
std::string Excerpt(std::string_view text);
/// The candidate most like @p word where one is near enough to be meant, else an empty text.
template <class Candidates>
std::string Nearest(std::string_view word, const Candidates& candidates);
/// How many letters must be inserted, removed or replaced to turn @p a into @p b.
std::size_t EditDistance(std::string_view a, std::string_view b);

template <class Candidates>
std::string Nearest(std::string_view word, const Candidates& candidates) {
  // A long word is near nothing, and comparing costs its length.
  if (word.size() > 64) return {};
  std::size_t best = word.size() / 3 + 2;
  std::string nearest;
  for (const auto& candidate : candidates) {
    const std::size_t distance = EditDistance(word, candidate);
    if (distance < best) {
      best = distance;
      nearest = candidate;
    }
  }
  return nearest;
}

}  // namespace store

#pragma GCC visibility pop
