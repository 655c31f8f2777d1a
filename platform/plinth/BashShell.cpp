#include <algorithm>

#include "plinth/Shells.h"
#include "plinth/Text.h"

namespace Plinth {

// Where the shell puts in what it lists, COMP_TYPE tells so, and nothing but words may stand there.
const char kBashScript[] = R"sh(# The program itself knows what may follow in a command line.
_hcli() {
  local columns=${COLUMNS:-80} answer
  case $COMP_TYPE in 37 | 42) columns=0 ;; esac
  mapfile -t answer < <(COMP_LINE=${COMP_LINE:0:COMP_POINT} COMP_WORD=$2 \
    command hcli propose bash --columns "$columns" 2>/dev/null)
  COMPREPLY=("${answer[@]:1}")
  case ${answer-} in
    files) compopt -o default ;;
    folders) compopt -o dirnames ;;
    open) compopt -o nospace ;;
  esac
}
complete -o nosort -F _hcli hcli
)sh";

namespace {

/// @p text as it has to be written in the shell, behind the open @p quote or outside of quotes.
std::string Written(std::string_view text, char quote) {
  const std::string_view special = quote == '"' ? "\\\"$`" : " \t\\\"'$`;&|<>()*?[]{}!#~";
  std::string written;
  for (const char c : text) {
    if (quote == '\'') {
      written += c == '\'' ? "'\\''" : std::string(1, c);
      continue;
    }
    if (special.find(c) != special.npos) written += '\\';
    written += c;
  }
  return written;
}

/// What of @p candidates takes the place of the end of the last word.
std::vector<Candidate> Replacements(const Question& question, const Candidates& candidates) {
  const OpenLine& line = question.line;
  const std::string& end = question.replaced;
  const std::size_t kept = line.written.ends_with(end) ? line.written.size() - end.size() : 0;
  const std::string front = ReadOpenLine(line.written.substr(0, kept)).last;
  std::vector<Candidate> replacements;
  for (const Candidate& candidate : candidates.list) {
    if (!candidate.word.starts_with(front)) continue;
    replacements.push_back(
        {Written(std::string_view(candidate.word).substr(front.size()), line.quote), candidate.description});
  }
  return replacements;
}

/// As much of the beginning as @p width columns hold, which are at least 1.
std::string Beginning(std::string text, std::size_t width) {
  if (DisplayWidth(text) <= width) return text;
  while (DisplayWidth(text) >= width) {
    while (!text.empty() && (static_cast<unsigned char>(text.back()) & 0xc0U) == 0x80) text.pop_back();
    text.pop_back();
  }
  return text + "\xe2\x80\xa6";
}

}  // namespace

std::string BashAnswer(const Question& question, const Candidates& candidates) {
  const std::vector<Candidate> replacements = Replacements(question, candidates);
  std::size_t width = 0;
  for (const Candidate& candidate : replacements) width = std::max(width, DisplayWidth(candidate.word));
  // The shell would put in the description of a single one, and shows no column for it to stand in.
  const bool isDescribed = replacements.size() > 1 && question.columns > width + 10;
  std::string lines;
  for (const Candidate& candidate : replacements) {
    std::string line = candidate.word;
    if (isDescribed && !candidate.description.empty()) {
      line += std::string(width - DisplayWidth(candidate.word), ' ') + "  -- ";
      line += Beginning(candidate.description, question.columns - 1 - width - 5);
    }
    lines += line + '\n';
  }
  return lines;
}

}  // namespace Plinth
