#include "store/Text.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <vector>

namespace store {

namespace {

constexpr std::string_view kLowerHex = "0123456789abcdef";

/// One character from the front of @p text, which gets shorter by it; nothing where it is malformed.
std::optional<char32_t> TakeCharacter(std::string_view& text) {
  const auto lead = static_cast<unsigned char>(text[0]);
  const std::size_t size = lead < 0x80   ? 1
                           : lead < 0xc2 ? 0
                           : lead < 0xe0 ? 2
                           : lead < 0xf0 ? 3
                           : lead < 0xf5 ? 4
                                         : 0;
  if (size == 0 || size > text.size()) return {};
  char32_t value = size == 1 ? lead : lead & (0x7fu >> size);
  for (std::size_t i = 1; i < size; ++i) {
    const auto next = static_cast<unsigned char>(text[i]);
    if ((next & 0xc0) != 0x80) return {};
    value = value << 6 | (next & 0x3fu);
  }
  constexpr char32_t kLeast[] = {0, 0, 0x80, 0x800, 0x10000};
  if (value < kLeast[size] || value > 0x10ffff || (value >= 0xd800 && value < 0xe000)) return {};
  text.remove_prefix(size);
  return value;
}

/// How many bytes in front are ASCII.
std::size_t AsciiLength(std::string_view text) {
  std::size_t length = 0;
  // Eight at a time: names of thousands of targets pass here.
  for (std::uint64_t eight = 0; length + sizeof eight <= text.size(); length += sizeof eight) {
    std::memcpy(&eight, text.data() + length, sizeof eight);
    if ((eight & 0x8080808080808080u) != 0) break;
  }
  while (length < text.size() && static_cast<unsigned char>(text[length]) < 0x80) ++length;
  return length;
}

}  // namespace

std::string LowerCase(std::string_view text) {
  std::string lower(text);
  for (char& c : lower) {
    if (c >= 'A' && c <= 'Z') c = static_cast<char>(c | 0x20);
  }
  return lower;
}

bool IsAscii(std::string_view text) { return AsciiLength(text) == text.size(); }

bool IsUtf8(std::string_view text) {
  for (;;) {
    text.remove_prefix(AsciiLength(text));
    if (text.empty()) return true;
    if (!TakeCharacter(text)) return false;
  }
}

std::string StorableFault(std::string_view text) {
  if (!IsUtf8(text)) return "is not UTF-8";
  return text.find('\0') == text.npos ? "" : "has a zero byte";
}

std::optional<std::wstring> WideFromUtf8(std::string_view text) {
  std::wstring wide;
  while (!text.empty()) {
    const auto character = TakeCharacter(text);
    if (!character) return {};
    wide += static_cast<wchar_t>(*character);
  }
  return wide;
}

std::optional<std::string> Utf8FromWide(std::wstring_view text) {
  const auto isAscii = [](wchar_t wide) { return wide >= 0 && wide < 0x80; };
  if (std::all_of(text.begin(), text.end(), isAscii)) return std::string(text.begin(), text.end());
  std::string narrow;
  for (const wchar_t wide : text) {
    const auto value = static_cast<char32_t>(wide);
    if (value > 0x10ffff || (value >= 0xd800 && value < 0xe000)) return {};
    const int more = value < 0x80 ? 0 : value < 0x800 ? 1 : value < 0x10000 ? 2 : 3;
    constexpr unsigned kLead[] = {0, 0xc0, 0xe0, 0xf0};
    narrow += static_cast<char>(kLead[more] | value >> (6 * more));
    for (int i = more - 1; i >= 0; --i) narrow += static_cast<char>(0x80 | (value >> (6 * i) & 0x3f));
  }
  return narrow;
}

std::string Printable(std::string_view text) {
  std::string printable;
  while (!text.empty()) {
    const std::string_view rest = text;
    const auto character = TakeCharacter(text);
    if (!character) text.remove_prefix(1);
    const std::string_view bytes = rest.substr(0, rest.size() - text.size());
    // Among the controls behind ASCII is one that begins the sequences of a terminal.
    const bool isControl = !character || *character < ' ' || (*character >= 0x7f && *character < 0xa0);
    if (character == U'\n') {
      printable += "\\n";
    } else if (!isControl) {
      printable += bytes;
    } else {
      for (const char byte : bytes) {
        printable += "\\x";
        printable += kLowerHex[static_cast<unsigned char>(byte) >> 4];
        printable += kLowerHex[static_cast<unsigned char>(byte) & 15];
      }
    }
  }
  return printable;
}

std::string Quoted(std::string_view text) {
  std::string quoted;
  for (const char c : text) {
    if (c == '"' || c == '\\') quoted += '\\';
    quoted += c;
  }
  return '"' + Printable(quoted) + '"';
}

std::string Excerpt(std::string_view text) {
  std::size_t size = 64;
  if (text.size() <= size) return Quoted(text);
  while (size > 0 && (static_cast<unsigned char>(text[size]) & 0xc0) == 0x80) --size;  // whole characters
  return Quoted(text.substr(0, size)) + "... (" + std::to_string(text.size()) + " bytes)";
}

std::size_t EditDistance(std::string_view a, std::string_view b) {
  std::vector<std::size_t> row(b.size() + 1);
  for (std::size_t j = 0; j <= b.size(); ++j) row[j] = j;
  for (std::size_t i = 0; i < a.size(); ++i) {
    std::size_t diagonal = row[0];
    row[0] = i + 1;
    for (std::size_t j = 0; j < b.size(); ++j) {
      const std::size_t replaced = diagonal + (a[i] == b[j] ? 0 : 1);
      diagonal = row[j + 1];
      row[j + 1] = std::min({replaced, row[j] + 1, diagonal + 1});
    }
  }
  return row[b.size()];
}

}  // namespace store
