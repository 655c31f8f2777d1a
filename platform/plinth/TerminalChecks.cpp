#include <langinfo.h>
#include <locale.h>
#include <stdlib.h>
#include <sys/ioctl.h>
#include <unistd.h>

#include <cstring>

#include "plinth/OwnChecks.h"
#include "plinth/Text.h"
#include "plinth/Tty.h"

namespace Plinth {

namespace {

Finding SizeFinding() {
  winsize size{};
  if (ioctl(STDOUT_FILENO, TIOCGWINSZ, &size) != 0 || size.ws_col == 0 || size.ws_row == 0) {
    return {"terminal size", FindingState::Warning,
            "The terminal does not tell its size: tables are not made to fit.", "stty rows 24 columns 80"};
  }
  const std::string text =
      std::to_string(size.ws_col) + " columns, " + std::to_string(size.ws_row) + " rows.";
  if (size.ws_col >= 40) return {"terminal size", FindingState::Ok, text, ""};
  return {"terminal size", FindingState::Warning, text, "Make the terminal at least 40 columns wide."};
}

/// All output is UTF-8.
Finding CharactersFinding() {
  const char* const check = "terminal characters";
  const locale_t locale = newlocale(LC_CTYPE_MASK, "", nullptr);
  if (locale == nullptr) {
    return {check, FindingState::Warning, "The locale that LC_ALL, LC_CTYPE or LANG names is not installed.",
            "export LC_ALL=C.UTF-8"};
  }
  const std::string codes = nl_langinfo_l(CODESET, locale);
  freelocale(locale);
  if (codes == "UTF-8") return {check, FindingState::Ok, "The locale says UTF-8.", ""};
  return {check, FindingState::Warning, "The locale says " + Visible(codes) + ", and all output is UTF-8.",
          "export LC_ALL=C.UTF-8"};
}

Finding ColorFinding() {
  const char* const check = "terminal colours";
  const char* const terminal = getenv("TERM");
  if (!terminal || !*terminal) {
    return {check, FindingState::Warning, "TERM is not set: there are neither colours nor a pager.",
            "export TERM=xterm"};
  }
  const char* const refused = getenv("NO_COLOR");
  const bool isPlain = IsDumbTerminal() || (refused && *refused);
  return {check, FindingState::Ok,
          "TERM is " + Visible(terminal) + (isPlain ? ": no colours, as you wish." : ": colours."), ""};
}

bool IsInPath(const std::string& program) {
  if (program.find('/') != program.npos) return access(program.c_str(), X_OK) == 0;
  const char* const path = getenv("PATH");
  for (const std::string& folder : Split(path ? path : "/bin:/usr/bin", ':')) {
    if (access((folder.empty() ? program : folder + '/' + program).c_str(), X_OK) == 0) return true;
  }
  return false;
}

Finding PagerFinding() {
  const char* const names[] = {"HCLI_PAGER", "PAGER"};
  std::string name = "less";
  std::string command = "less";
  for (const char* variable : names) {
    const char* const value = getenv(variable);
    if (!value) continue;
    name = variable;
    command = value;
    break;
  }
  if (command.empty() || command == "cat") {
    return {"pager", FindingState::Ok, name + " says that there is none.", ""};
  }
  // Of what is more than a program with its options, the shell alone knows whether it works.
  const bool isPlain = command.find_first_of("|&;<>()$`\\\"'=*?[#~%!{}") == command.npos;
  const std::string program = command.substr(0, command.find(' '));
  if (!isPlain || IsInPath(program))
    return {"pager", FindingState::Ok, "It is " + Visible(command) + '.', ""};
  return {"pager", FindingState::Warning,
          "The program " + Quoted(program) + " is not there: what does not fit on the screen scrolls by.",
          name == "less" ? "Install less, or set HCLI_PAGER."
                         : "Install it, or set " + name + " to another one."};
}

}  // namespace

void CheckTerminal(std::vector<Finding>& findings) {
  if (isatty(STDOUT_FILENO) != 1) {
    findings.push_back({"terminal", FindingState::Ok,
                        "Standard output is none: nothing is cut, coloured or paged there.", ""});
    return;
  }
  findings.push_back(SizeFinding());
  findings.push_back(CharactersFinding());
  findings.push_back(ColorFinding());
  findings.push_back(PagerFinding());
}

}  // namespace Plinth
