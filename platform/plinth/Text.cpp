#include "plinth/Text.h"

#include <langinfo.h>
#include <locale.h>
#include <wchar.h>

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <cstring>

namespace Plinth {

Character DecodeUtf8(std::string_view text, std::size_t at) {
  const auto byte = [&](std::size_t index) -> unsigned { return static_cast<unsigned char>(text[index]); };
  const unsigned first = byte(at);
  if (first < 0x80) return {first, 1, true};
  const std::size_t length = first >= 0xf0 ? 4 : first >= 0xe0 ? 3 : 2;
  if (first < 0xc2 || first > 0xf4 || at + length > text.size()) return {first, 1, false};
  char32_t code = first & (0xffU >> (length + 1));
  for (std::size_t next = 1; next < length; ++next) {
    if ((byte(at + next) & 0xc0U) != 0x80) return {first, 1, false};
    code = (code << 6U) | (byte(at + next) & 0x3fU);
  }
  static constexpr char32_t kSmallest[] = {0, 0, 0x80, 0x800, 0x10000};
  const bool valid = code >= kSmallest[length] && code <= 0x10ffff && (code < 0xd800 || code > 0xdfff);
  return valid ? Character{code, length, true} : Character{first, 1, false};
}

std::size_t PlainLength(std::string_view text) {
  // Eight bytes at a time, of which each is looked at by its highest bit.
  constexpr std::uint64_t kEach = 0x0101010101010101;
  std::size_t length = 0;
  for (std::uint64_t bytes; text.size() - length >= sizeof bytes; length += sizeof bytes) {
    std::memcpy(&bytes, text.data() + length, sizeof bytes);
    const std::uint64_t isBelowBlank = bytes - ' ' * kEach;
    const std::uint64_t isAboveTilde = bytes + (0x7f - '~') * kEach;
    if (((isBelowBlank | isAboveTilde | bytes) & 0x80 * kEach) != 0) break;
  }
  while (length < text.size() && text[length] >= ' ' && text[length] <= '~') ++length;
  return length;
}

std::string Visible(std::string_view text, Lines lines) {
  std::size_t at = PlainLength(text);
  std::string visible(text.substr(0, at));
  visible.reserve(text.size());
  while (at < text.size()) {
    const Character character = DecodeUtf8(text, at);
    const std::string_view bytes = text.substr(at, character.length);
    at += character.length;
    const bool line = character.code == '\n' || character.code == '\t';
    const bool control = character.code < 0x20 || (character.code >= 0x7f && character.code < 0xa0);
    if (character.valid && (!control || (line && lines == Lines::Kept))) {
      visible += bytes;
    } else if (line) {
      visible += character.code == '\n' ? "\\n" : "\\t";
    } else {
      for (const char byte : bytes) {
        char hex[8];
        std::snprintf(hex, sizeof hex, "\\x%02x", static_cast<unsigned>(static_cast<unsigned char>(byte)));
        visible += hex;
      }
    }
  }
  return visible;
}

std::string Quoted(std::string_view text) { return '"' + Visible(text) + '"'; }

namespace {

/// Names are UTF-8 whatever the caller's environment says. The C library needs to know that for wide
/// characters alone, and reads large files for it.
void UseUtf8() {
  if (setlocale(LC_CTYPE, "") && std::strcmp(nl_langinfo(CODESET), "UTF-8") == 0) return;
  setlocale(LC_CTYPE, "C.UTF-8");
}

int Columns(char32_t code) {
  static const bool ready = (UseUtf8(), true);
  return ready ? wcwidth(static_cast<wchar_t>(code)) : 1;
}

}  // namespace

std::size_t DisplayWidth(std::string_view visible) {
  std::size_t at = PlainLength(visible);
  std::size_t width = at;
  while (at < visible.size()) {
    const Character character = DecodeUtf8(visible, at);
    at += character.length;
    const int columns = character.code < 0x80 ? 1 : Columns(character.code);
    width += columns < 0 ? 1U : static_cast<std::size_t>(columns);
  }
  return width;
}

std::string Shortened(std::string_view visible, std::size_t width) {
  const std::size_t whole = DisplayWidth(visible);
  if (whole <= width) return std::string(visible);
  // The mark takes one column. Up to where the columns of the front end, and from where those of the back
  // begin.
  const std::size_t front = width / 2;
  const std::size_t back = whole - (width - 1 - front);
  std::string shortened;
  std::size_t column = 0;
  bool isMarked = false;
  for (std::size_t at = 0; at < visible.size();) {
    const std::string_view character = visible.substr(at, DecodeUtf8(visible, at).length);
    const std::size_t end = column + DisplayWidth(character);
    const bool isFront = !isMarked && end <= front;
    if (!isFront && !isMarked) {
      shortened += "\xe2\x80\xa6";
      isMarked = true;
    }
    // What combines with a character that is left out is left out with it.
    if (isFront || (column >= back && (end > column || column > back))) shortened += character;
    column = end;
    at += character.size();
  }
  return shortened;
}

std::string Wrap(const std::string& text, std::size_t indent, std::size_t screen) {
  std::string wrapped;
  for (const std::string& line : Split(Visible(text, Lines::Kept), '\n')) {
    if (!wrapped.empty()) wrapped += '\n' + std::string(indent, ' ');
    std::size_t column = indent;
    for (const std::string& word : Split(line, ' ')) {
      const std::size_t width = DisplayWidth(word);
      if (column > indent && column + 1 + width > screen) {
        wrapped += '\n' + std::string(indent, ' ');
        column = indent;
      } else if (column > indent) {
        wrapped += ' ';
        ++column;
      }
      wrapped += word;
      column += width;
    }
  }
  return wrapped;
}

std::string Join(const std::vector<std::string>& parts, std::string_view separator) {
  std::string joined;
  for (std::size_t index = 0; index < parts.size(); ++index) {
    if (index > 0) joined += separator;
    joined += parts[index];
  }
  return joined;
}

std::vector<std::string> Split(std::string_view text, char separator) {
  std::vector<std::string> parts;
  for (;;) {
    const std::size_t end = text.find(separator);
    parts.emplace_back(text.substr(0, end));
    if (end == text.npos) return parts;
    text.remove_prefix(end + 1);
  }
}

namespace {

/// Inserted, removed, replaced and swapped characters that lead from one word to the other.
std::size_t EditDistance(std::string_view from, std::string_view to) {
  std::vector<std::vector<std::size_t>> cost(from.size() + 1, std::vector<std::size_t>(to.size() + 1));
  for (std::size_t row = 0; row <= from.size(); ++row) {
    for (std::size_t column = 0; column <= to.size(); ++column) {
      if (row == 0 || column == 0) {
        cost[row][column] = row + column;
        continue;
      }
      const std::size_t change = from[row - 1] == to[column - 1] ? 0 : 1;
      cost[row][column] = std::min(
          {cost[row - 1][column] + 1, cost[row][column - 1] + 1, cost[row - 1][column - 1] + change});
      if (row > 1 && column > 1 && from[row - 1] == to[column - 2] && from[row - 2] == to[column - 1]) {
        cost[row][column] = std::min(cost[row][column], cost[row - 2][column - 2] + 1);
      }
    }
  }
  return cost[from.size()][to.size()];
}

}  // namespace

std::string Nearest(std::string_view word, const std::vector<std::string>& candidates) {
  // Longer words cannot be near anything, and must not cost time.
  if (word.size() > 64) return "";
  std::string nearest;
  std::size_t limit = std::max<std::size_t>(1, word.size() / 3);
  for (const std::string& candidate : candidates) {
    const std::size_t distance = EditDistance(word, candidate);
    if (distance > limit || distance >= candidate.size()) continue;
    if (!nearest.empty() && distance == limit) continue;
    nearest = candidate;
    limit = distance;
  }
  return nearest;
}

}  // namespace Plinth
