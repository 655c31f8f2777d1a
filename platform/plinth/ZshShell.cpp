#include "plinth/Shells.h"

namespace Plinth {

// The file is sourced, or it is what zsh runs for the function of its name when that is called first.
const char kZshScript[] = R"sh(#compdef hcli
# The program itself knows what may follow in a command line.
_hcli() {
  local -a answer
  answer=("${(@f)$(COMP_LINE="${(j: :)words[1,CURRENT-1]} $PREFIX" command hcli propose zsh 2>/dev/null)}")
  case "$answer[1]" in
    files) compset -P '--*='; _files ;;
    folders) compset -P '--*='; _files -/ ;;
    open) answer=("${(@)answer[2,-1]}"); _describe -V hcli answer -S '' ;;
    *) answer=("${(@)answer[2,-1]}"); _describe -V hcli answer ;;
  esac
}
if [ "$funcstack[1]" = _hcli ]; then
  _hcli "$@"
else
  compdef _hcli hcli
fi
)sh";

std::string ZshAnswer(const Question&, const Candidates& candidates) {
  std::string lines;
  for (const Candidate& candidate : candidates.list) {
    for (const char c : candidate.word) {
      if (c == ':' || c == '\\') lines += '\\';
      lines += c;
    }
    if (!candidate.description.empty()) lines += ':' + candidate.description;
    lines += '\n';
  }
  return lines;
}

}  // namespace Plinth
