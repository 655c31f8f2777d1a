/// The shells that can complete command lines with what hcli answers. One source file a shell, and its row.
#pragma once

#include <string>

#include "plinth/Candidates.h"
#include "plinth/Words.h"

namespace Plinth {

/// What a shell has asked.
struct Question {
  OpenLine line;
  /// The end of the last word as it is written, which is what the shell puts a candidate in the place of.
  std::string replaced;
  /// How wide the terminal is; 0 for candidates without descriptions.
  std::size_t columns = 0;
};

/// The lines that the shell's script reads. The first one is a word for what there is: "words", "open" for
/// words behind which no blank comes, "files" or "folders". The others are candidates as that shell takes
/// them.
using WriteAnswer = std::string(const Question& question, const Candidates& candidates);
WriteAnswer BashAnswer;
WriteAnswer ZshAnswer;
WriteAnswer FishAnswer;

extern const char kBashScript[];
extern const char kZshScript[];
extern const char kFishScript[];

/// The line in the variable COMP_LINE, up to the cursor and without the program's name: on the command line
/// of a process, everybody could read a secret in it.
OpenLine LineAtCursor();

struct Shell {
  const char* name;
  const char* script;
  WriteAnswer* answer;
};

inline constexpr Shell kShells[] = {
    {"bash", kBashScript, BashAnswer}, {"zsh", kZshScript, ZshAnswer}, {"fish", kFishScript, FishAnswer}};

}  // namespace Plinth
