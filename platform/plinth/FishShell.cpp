#include "plinth/Shells.h"

namespace Plinth {

const char kFishScript[] = R"sh(# The program itself knows what may follow in a command line.
function __hcli_complete
    set -l answer (COMP_LINE=(commandline -pc | string collect) command hcli propose fish 2>/dev/null)
    set -l before (commandline -ct | string match -r '^--[^=]*=')
    switch "$answer[1]"
        case files
            __fish_complete_path (string replace -- "$before" '' (commandline -ct)) | string replace -r '^' -- "$before"
        case folders
            __fish_complete_directories (string replace -- "$before" '' (commandline -ct)) | string replace -r '^' -- "$before"
        case '*'
            printf '%s\n' $answer[2..]
    end
end
complete -c hcli -e
complete -c hcli -f -k -a '(__hcli_complete)'
)sh";

std::string FishAnswer(const Question&, const Candidates& candidates) {
  std::string lines;
  for (const Candidate& candidate : candidates.list) {
    lines += candidate.word;
    if (!candidate.description.empty()) lines += '\t' + candidate.description;
    lines += '\n';
  }
  return lines;
}

}  // namespace Plinth
