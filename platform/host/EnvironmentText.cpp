#include "host/EnvironmentText.h"

#include <algorithm>

#include "host/Formats.h"
#include "host/Storage.h"

namespace host {

namespace {

constexpr std::string_view kBlanks = " \t\r";
constexpr std::string_view kNeedNoQuotes =
    "abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ0123456789_-.,:/@%+=";
constexpr std::string_view kIdentifier = "abcdefghijklmnopqrstuvwxyzABCDEFGHIJKLMNOPQRSTUVWXYZ_0123456789";

[[noreturn]] void Refuse(const std::string& text) { throw host::Error(host::Error::Kind::Invalid, text); }

std::size_t IdentifierLength(std::string_view text) {
  if (text.empty() || (text[0] >= '0' && text[0] <= '9')) return 0;
  return std::min(text.find_first_not_of(kIdentifier), text.size());
}

/// Reads one word as a shell does: returns where it ends, npos when it goes on behind the line. What it means
/// is appended to @p meaning.
std::size_t ReadWord(std::string_view text, std::string& meaning) {
  char quote = 0;
  std::size_t i = 0;
  for (; i < text.size(); ++i) {
    const char c = text[i];
    if (quote == '\'') {
      if (c == '\'') {
        quote = 0;
      } else {
        meaning += c;
      }
    } else if (c == '\\') {
      if (++i == text.size()) return text.npos;
      // Inside double quotes a backslash is one, except in front of these.
      if (quote == '"' && std::string_view("$`\"\\").find(text[i]) == text.npos) meaning += c;
      meaning += text[i];
    } else if (c == quote) {
      quote = 0;
    } else if (quote == 0 && (c == '"' || c == '\'')) {
      quote = c;
    } else if (quote == 0 && kBlanks.find(c) != kBlanks.npos) {
      break;
    } else {
      meaning += c;
    }
  }
  return quote == 0 ? i : text.npos;
}

std::string InQuotes(const std::string& value) {
  if (value.find_first_not_of(kNeedNoQuotes) == value.npos && !value.empty()) return value;
  std::string quoted = "'";
  for (const char c : value) {
    if (c == '\'') {
      quoted += "'\\''";
    } else {
      quoted += c;
    }
  }
  return quoted + "'";
}

}  // namespace

EnvironmentText::Line EnvironmentText::ParseLine(std::string_view text, std::size_t number) {
  const auto refuse = [number](const char* what) {
    throw host::Error(
        host::Error::Kind::DamagedFile,
        "line " + std::to_string(number) + ": " + what + ", expected NAME=VALUE, a comment or an empty line");
  };
  Line line;
  std::size_t begin = std::min(text.find_first_not_of(kBlanks), text.size());
  if (begin == text.size() || text[begin] == '#') {
    line.before = text;
    return line;
  }
  if (text.substr(begin).starts_with("export ") || text.substr(begin).starts_with("export\t")) {
    begin = std::min(text.find_first_not_of(kBlanks, begin + 6), text.size());
  }
  const std::size_t length = IdentifierLength(text.substr(begin));
  if (length == 0 || begin + length == text.size() || text[begin + length] != '=') refuse("no assignment");
  line.before = text.substr(0, begin);
  line.name = text.substr(begin, length);
  const std::string_view rest = text.substr(begin + length + 1);
  std::string meaning;
  const std::size_t end = ReadWord(rest, meaning);
  if (end == rest.npos) refuse("the value does not end on its line");
  line.value = rest.substr(0, end);
  line.after = rest.substr(end);
  return line;
}

void EnvironmentText::Parse(std::string_view text) {
  std::vector<Line> lines;
  while (!text.empty()) {
    const std::size_t end = text.find('\n');
    lines.push_back(ParseLine(text.substr(0, end), lines.size() + 1));
    lines.back().ends = end != text.npos;
    text.remove_prefix(std::min(end, text.size() - 1) + 1);
  }
  lines_ = std::move(lines);
}

void EnvironmentText::Set(const std::string& name, const std::string& value) {
  if (name.empty() || IdentifierLength(name) != name.size()) {
    Refuse(host::Quoted(name) + " is no name of a variable: expected letters, digits and underscores.");
  }
  if (value.find_first_of(std::string_view("\0\n\r", 3)) != value.npos) {
    Refuse("The value of " + name + " has a zero or a line break, which no line can hold.");
  }
  bool found = false;
  for (Line& line : lines_) {
    if (line.name != name) continue;
    found = true;
    line.value = InQuotes(value);
    // A comment behind the value stays; more words would turn into a part of the new one.
    const std::size_t next = line.after.find_first_not_of(kBlanks);
    if (next != line.after.npos && line.after[next] != '#') line.after.clear();
  }
  if (found) return;
  if (!lines_.empty()) lines_.back().ends = true;
  lines_.push_back({.before = {}, .name = name, .value = InQuotes(value), .after = {}});
}

std::optional<std::string> EnvironmentText::Get(std::string_view name) const {
  const auto line =
      std::find_if(lines_.rbegin(), lines_.rend(), [&](const Line& one) { return one.name == name; });
  if (line == lines_.rend()) return {};
  std::string meaning;
  ReadWord(line->value, meaning);
  return meaning;
}

std::string EnvironmentText::Text() const {
  std::string text;
  for (const Line& line : lines_) {
    text += line.before;
    if (!line.name.empty()) text += line.name + "=" + line.value + line.after;
    if (line.ends) text += '\n';
  }
  return text;
}

}  // namespace host
