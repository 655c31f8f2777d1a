#include <stdlib.h>

#include <algorithm>
#include <cstring>
#include <iterator>

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
    static constexpr const char* kWithText[] = {"Usage:", "Result:", "Exit status:"};
    const auto begins = [&](const char* heading) { return line.starts_with(heading); };
    if (end + 1 == line.size() || std::any_of(std::begin(kWithText), std::end(kWithText), begins)) {
      line = kHeading + line.substr(0, end + 1) + kPlain + line.substr(end + 1);
    }
  }
  return Join(lines, "\n");
}

}  // namespace Plinth
