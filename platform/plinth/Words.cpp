#include "plinth/Words.h"

#include "plinth/Options.h"

namespace Plinth {

namespace {

// With the carriage return that ends lines of files from elsewhere.
constexpr std::string_view kBlanks = " \t\r";
/// What ends a word in a line that a shell runs.
constexpr std::string_view kBreaks = " \t\r\n<>";

bool IsOneOf(char c, std::string_view characters) { return characters.find(c) != characters.npos; }

/// What the line ends in the middle of: a quote of either kind, what a backslash stands for, or nothing.
enum class Open : char { Nothing = 0, Single = '\'', Double = '"', Backslash = '\\' };

/// Reads on behind a double quote to the next, which @p at is then behind.
Open ReadQuoted(std::string_view line, std::size_t& at, std::string& word) {
  while (at < line.size()) {
    char c = line[at++];
    if (c == '"') return Open::Nothing;
    // In front of others, a backslash is one.
    if (c == '\\' && at < line.size() && IsOneOf(line[at], "$`\"\\")) c = line[at++];
    word += c;
  }
  return Open::Double;
}

/// Reads up to one of @p breaks that is not quoted.
Open ReadWord(std::string_view line, std::size_t& at, std::string_view breaks, std::string& word) {
  Open open = Open::Nothing;
  while (at < line.size() && !IsOneOf(line[at], breaks) && open == Open::Nothing) {
    const char c = line[at++];
    if (c == '\'') {
      const std::size_t end = line.find('\'', at);
      word += line.substr(at, end == line.npos ? end : end - at);
      at = end == line.npos ? line.size() : end + 1;
      if (end == line.npos) open = Open::Single;
    } else if (c == '"') {
      open = ReadQuoted(line, at, word);
    } else if (c == '\\' && at == line.size()) {
      open = Open::Backslash;
    } else {
      word += c == '\\' ? line[at++] : c;
    }
  }
  return open;
}

}  // namespace

std::vector<std::string> SplitWords(std::string_view line) {
  if (line.find('\0') != line.npos) throw UsageError("the line has a zero byte");
  std::vector<std::string> words;
  for (std::size_t at = 0;;) {
    at = line.find_first_not_of(kBlanks, at);
    if (at == line.npos || line[at] == '#') return words;
    switch (ReadWord(line, at, kBlanks, words.emplace_back())) {
      case Open::Nothing:
        break;
      case Open::Single:
        throw UsageError("the single quote is not closed on its line");
      case Open::Double:
        throw UsageError("the double quote is not closed on its line");
      case Open::Backslash:
        throw UsageError("the line ends with a backslash; a command stands on one line");
    }
  }
}

OpenLine ReadOpenLine(std::string_view line) {
  OpenLine read;
  std::size_t at = 0;
  while (at < line.size()) {
    if (IsOneOf(line[at], "<>")) {
      read.isRedirection = true;
      at = line.find_first_not_of("<>&|", at);
      if (at == line.npos) break;
    } else if (IsOneOf(line[at], kBreaks)) {
      ++at;
    } else {
      std::string word;
      const std::size_t begin = at;
      const Open open = ReadWord(line, at, kBreaks, word);
      if (at == line.size()) {
        read.last = std::move(word);
        read.written = line.substr(begin);
        read.quote = open == Open::Backslash ? '\0' : static_cast<char>(open);
        break;
      }
      const bool isNumber = word.find_first_not_of("0123456789") == word.npos;
      // The number of the file that is redirected stands right in front.
      if (!read.isRedirection && !(isNumber && IsOneOf(line[at], "<>")))
        read.words.push_back(std::move(word));
      read.isRedirection = false;
    }
  }
  return read;
}

}  // namespace Plinth
