#include <stdlib.h>

#include <cstring>

#include "plinth/Run.h"
#include "plinth/Text.h"
#include "plinth/Tty.h"

namespace Plinth {

std::vector<std::string> ColorWords() { return {"auto", "always", "never"}; }

bool IsDumbTerminal() {
  const char* const terminal = getenv("TERM");
  return !terminal || !*terminal || std::strcmp(terminal, "dumb") == 0;
}

bool IsColored(const Run& run, bool isTerminal) {
  const Given& given = run.request.global.For("color");
  if (given.given && given.texts.front() == "always") return true;
  if (given.given && given.texts.front() == "never") return false;
  const char* const refused = getenv("NO_COLOR");
  return isTerminal && !IsDumbTerminal() && !(refused && *refused);
}

std::string WithHeadings(const std::string& help) {
  std::vector<std::string> lines = Split(help, '\n');
  for (std::string& line : lines) {
    const std::size_t end = line.find(':');
    if (line.empty() || line.front() == ' ' || end == line.npos) continue;
    if (end + 1 == line.size() || line.starts_with("Usage:") || line.starts_with("Result:")) {
      line = kHeading + line.substr(0, end + 1) + kPlain + line.substr(end + 1);
    }
  }
  return Join(lines, "\n");
}

}  // namespace Plinth
