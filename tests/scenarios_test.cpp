// Command lines with all that comes of them, in tests/scenarios. UPDATE_GOLDEN=1 writes the files anew from
// their lines of these kinds; a diff shows what has become different:
//     {...        a host description, up to a line that is "}"
//     @ PATCH     the JSON Patch (RFC 6902) by which the hosts of the commands behind it differ from that
//     $ COMMAND   a command line behind "hcli", or behind the class of a command without a path, on a new
//     host > COMMAND   the same, on the host as the one before has left it
// Behind a command stand its calls, "!" and each report, "=" and its result, "*" and each change of the host.
#include <filesystem>
#include <optional>
#include <sstream>

#include "support/Harness.h"
#include "support/ProjectFile.h"
#include "support/SweepTable.h"

namespace {

using nlohmann::json;

Outcome Run(Harness& host, const std::string& line) {
  const std::size_t space = std::min(line.find(' '), line.size());
  for (const sweep::SweptCommand& command : sweep::Commands()) {
    if (command.make && command.name == line.substr(0, space))
      return host(command.make(), line.substr(space));
  }
  return host("iscsi " + line);
}

void Show(std::ostream& shown, const Outcome& run, const json& changes) {
  for (const std::string& call : run.trace) shown << "  " << call << '\n';
  for (const std::string& message : run.messages) shown << "! " << json(message) << '\n';
  if (!run.failure.empty()) shown << "! " << json(run.failure) << " (status " << run.status << ")\n";
  if (!run.result.is_null()) shown << "= " << run.result << '\n';
  for (const json& change : changes) shown << "* " << change << '\n';
}

std::string Play(std::istream&& file) {
  std::ostringstream shown;
  json base;
  json description;
  std::optional<Harness> host;
  for (std::string line; std::getline(file, line);) {
    if (line.starts_with("  ") || (!line.empty() && std::string("!=*").find(line[0]) != std::string::npos))
      continue;
    shown << line << '\n';
    if (line.starts_with("{")) {
      std::string text = line;
      while (line != "}" && std::getline(file, line)) {
        shown << line << '\n';
        text += line;
      }
      description = base = json::parse(text);
    } else if (line.starts_with("@ ")) {
      description = base.patch(json::parse(line.substr(2)));
    } else if (line.starts_with("$ ") || line.starts_with("> ")) {
      if (line[0] == '$') host.emplace(description.dump());
      const json before = host->Show();
      const Outcome run = Run(*host, line.substr(2));
      Show(shown, run, json::diff(before, host->Show()));
    }
  }
  return shown.str();
}

TEST(Scenarios, GoAsTheyAreWrittenDown) {
  int files = 0;
  for (const auto& file : std::filesystem::directory_iterator(ProjectFile("tests/scenarios"))) {
    const std::string name = "tests/scenarios/" + file.path().filename().string();
    ExpectFile(name, Play(std::istringstream(FileText(name))));
    ++files;
  }
  EXPECT_GT(files, 1);
}

}  // namespace
