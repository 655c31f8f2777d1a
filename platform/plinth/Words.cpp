#include "plinth/Words.h"

#include "plinth/Options.h"

namespace Plinth {

namespace {

// With the carriage return that ends lines of files from elsewhere.
constexpr std::string_view kBlanks = " \t\r";

/// Reads on behind a double quote to the next, which @p at is then behind.
void ReadQuoted(std::string_view line, std::size_t& at, std::string& word) {
  while (at < line.size()) {
    char c = line[at++];
    if (c == '"') return;
    // In front of others, a backslash is one.
    if (c == '\\' && at < line.size() && std::string_view("$`\"\\").find(line[at]) != line.npos)
      c = line[at++];
    word += c;
  }
  throw UsageError("the double quote is not closed on its line");
}

std::string ReadWord(std::string_view line, std::size_t& at) {
  std::string word;
  while (at < line.size() && kBlanks.find(line[at]) == kBlanks.npos) {
    const char c = line[at++];
    if (c == '\'') {
      const std::size_t end = line.find('\'', at);
      if (end == line.npos) throw UsageError("the single quote is not closed on its line");
      word += line.substr(at, end - at);
      at = end + 1;
    } else if (c == '"') {
      ReadQuoted(line, at, word);
    } else if (c == '\\' && at == line.size()) {
      throw UsageError("the line ends with a backslash; a command stands on one line");
    } else {
      word += c == '\\' ? line[at++] : c;
    }
  }
  return word;
}

}  // namespace

std::vector<std::string> SplitWords(std::string_view line) {
  if (line.find('\0') != line.npos) throw UsageError("the line has a zero byte");
  std::vector<std::string> words;
  for (std::size_t at = 0;; words.push_back(ReadWord(line, at))) {
    at = line.find_first_not_of(kBlanks, at);
    if (at == line.npos || line[at] == '#') return words;
  }
}

}  // namespace Plinth
