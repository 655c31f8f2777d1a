// Command lines of every command, one a line, words and quotes as a shell has them; a zero stands for a line
// break in a word. Whatever they are, the exit status is one of those defined and fits what was said and
// posted, --output json shows one document that says the same, other outputs show no control characters, the
// library's memory comes back, and the host stays one that can be shown and loaded.
#include <fcntl.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <cerrno>
#include <cstdarg>
#include <filesystem>
#include <nlohmann/json.hpp>

#include "Support.h"
#include "host/Formats.h"
#include "host/Storage.h"
#include "ima/Memory.h"
#include "plinth/CommandLine.h"
#include "plinth/Declarations.h"
#include "plinth/OwnCommands.h"
#include "simulator/Commands.h"
#include "simulator/Simulator.h"
#include "support/SweepTable.h"
#include "support/Words.h"

extern "C" void AutoCli_RegisterNamespaces(boost::shared_ptr<Plinth::AutoCli::Namespace> parent);

/// Stands in front of the C library's function for all code under test: a command that takes the name of a
/// file finds it below the temporary root, and no other file can be reached.
extern "C" int open(const char* path, int flags, ...) {
  const std::string& root = fuzz::TemporaryRoot();
  std::string place = path;
  if (place.find("..") != place.npos) {
    errno = ENOENT;
    return -1;
  }
  if (place != root && !place.starts_with(root + '/')) {
    fuzz::Require((flags & O_ACCMODE) == O_RDONLY, "written outside the root: " + place);
    place = root + '/' + place;
  }
  va_list more;
  va_start(more, flags);
  const unsigned mode = (flags & O_CREAT) != 0 ? va_arg(more, unsigned) : 0;
  va_end(more);
  return static_cast<int>(syscall(SYS_openat, AT_FDCWD, place.c_str(), flags, mode));
}

namespace {

using Plinth::AutoCli::Namespace;

constexpr std::size_t kMostLines = 8;
constexpr const char* kUnregistered = "unregistered";

boost::shared_ptr<Namespace> MakeTree() {
  const auto root = Namespace::New();
  AutoCli_RegisterNamespaces(root);
  root->RegisterNamespaceNode(simulator::NewNamespace(), "simulator");
  const auto unregistered = Namespace::New();
  for (const sweep::SweptCommand& command : sweep::Commands()) {
    if (command.make != nullptr) unregistered->RegisterNamespaceNode(command.make(), command.name);
  }
  root->RegisterNamespaceNode(unregistered, kUnregistered);
  Plinth::RegisterOwnCommands(*root);
  return root;
}

struct KnownCommand {
  std::string path;
  std::vector<Plinth::Parameter> parameters;
};

/// What there is to run, and what to run it on.
struct World {
  boost::shared_ptr<Namespace> tree = MakeTree();
  std::vector<KnownCommand> commands;
  std::vector<std::string> lines;   ///< that are right
  std::vector<std::string> values;  ///< that options may have
  std::string description = sweep::HostDescription();

  World() {
    const std::string& root = fuzz::TemporaryRoot();
    fuzz::WriteFile(root + "/image", "ISCSI-ADAPTER-IMAGE 1\ntype: firmware\nversion: 2\nlength: 1\nx");
    fuzz::WriteFile(root + "/host.json", description);
    Plinth::WalkTree(*tree, "", [&](const std::string& path, Plinth::AutoCli::NamespaceNode& node) {
      commands.push_back({path, {}});
      if (!Plinth::AutoCli::NodeData::Of(node).isCommand) return;
      auto& command = dynamic_cast<Plinth::AutoCli::Command&>(node);
      commands.back().parameters = Plinth::ParametersOf(*command.GetInputSpec());
    });
    values = fuzz::TextsOf(description);
    for (const sweep::SweptCommand& command : sweep::Commands()) {
      for (std::string options : sweep::Parts(command.lines)) {
        if (const std::size_t file = options.find("FILE"); file != options.npos)
          options.replace(file, 4, "/image");
        for (const std::string& word : SplitWords(options)) values.push_back(word);
        lines.push_back((command.make == nullptr ? "iscsi " : std::string(kUnregistered) + ' ') +
                        command.name + ' ' + options);
      }
    }
    values.insert(values.end(), {"''", "-", "0", "-1", "4294967296", "/host.json", "json", "table", "yes"});
  }
};

const World& TheWorld() {
  static const World world;
  return world;
}

void RequireVisible(const std::string& text) {
  fuzz::Require(host::IsUtf8(text), "an output that is not UTF-8");
  for (const char c : text) {
    fuzz::Require(c == '\n' || c == '\t' || (c != 0x7f && !(c >= 0 && c < ' ')),
                  "a control character: " + text);
  }
}

void RequireDocument(const std::string& text, const Plinth::RunRecord& run) {
  const auto document = nlohmann::json::parse(text, nullptr, false);
  fuzz::Require(document.is_object() && document["status"] == run.status, "no document of the run: " + text);
  fuzz::Require(document["messages"].size() == run.messages.size() + (run.failure.empty() ? 0 : 1),
                "a document without the messages: " + text);
}

void Run(const std::string& line) {
  std::vector<std::string> words = SplitWords(line);
  for (std::string& word : words) std::replace(word.begin(), word.end(), '\0', '\n');
  Plinth::TextConsole console;
  console.input = "a secret that is read\n";
  const Plinth::RunRecord run = Plinth::RunCommandLine(*TheWorld().tree, words, console, {.checked = true});
  const bool posted = run.result != nullptr;
  const bool reported = !run.messages.empty();
  switch (run.status) {
    case Plinth::kSuccess:
      fuzz::Require(!reported && run.failure.empty() && posted == run.executed, "success without a result");
      break;
    case Plinth::kReported:
      fuzz::Require(reported && !posted, "status 1 without a report, or with a result");
      break;
    case Plinth::kUsage:
      fuzz::Require(!run.executed && !run.failure.empty(), "status 2 of a command that ran");
      break;
    case Plinth::kResultAndReported:
      fuzz::Require(reported && posted, "status 3 without a report, or without a result");
      break;
    default:
      fuzz::Fail("status " + std::to_string(run.status) + ": " + run.failure);
  }
  fuzz::Require(ima::OutstandingAllocations() == 0, "memory of the management API is kept");
  if (words.size() > 1 && words[0] == "--output" && words[1] == "json") {
    RequireDocument(console.out.text, run);
  } else {
    RequireVisible(console.out.text);
  }
}

class Mutator {
 public:
  explicit Mutator(unsigned seed) : random_(seed) {}

  void Change(std::vector<std::string>& lines) {
    const std::size_t at = random_.Below(lines.size() + 1);
    if (at == lines.size() || random_.OneIn(8)) {
      if (lines.size() < kMostLines) lines.insert(lines.begin() + static_cast<std::ptrdiff_t>(at), Line());
      return;
    }
    std::string& line = lines[at];
    switch (random_.Below(8)) {
      case 0:
        lines.erase(lines.begin() + static_cast<std::ptrdiff_t>(at));
        break;
      case 1:
        line = Line();
        break;
      case 2:
        line.insert(0, "--output json ");
        break;
      case 3:
      case 4:
        line += Option(line);
        break;
      default:
        ChangeWord(line);
    }
  }

 private:
  std::string Line() {
    if (!random_.OneIn(8)) return random_.Of(TheWorld().lines);
    return random_.Of(TheWorld().commands).path;
  }

  /// One that the command of the line declares.
  std::string Option(const std::string& line) {
    const KnownCommand* meant = nullptr;
    for (const KnownCommand& command : TheWorld().commands) {
      const std::size_t at = line.find(command.path);
      if (at != line.npos && !command.parameters.empty()) meant = &command;
    }
    if (meant == nullptr) return " --" + random_.Of(TheWorld().values);
    const Plinth::Parameter& parameter = random_.Of(meant->parameters);
    const std::string name = " --" + parameter.name;
    if (parameter.type == Plinth::CallSpec::ParameterType::Flag) return name;
    if (parameter.type == Plinth::CallSpec::ParameterType::Bool)
      return name + (random_.OneIn(2) ? " yes" : " no");
    if (!parameter.allowed.empty()) return name + ' ' + random_.Of(parameter.allowed).value;
    return name + " '" + random_.Of(TheWorld().values) + '\'';
  }

  /// Puts another value in its place, or takes it away.
  void ChangeWord(std::string& line) {
    std::size_t begin = line.find(' ', random_.Below(line.size() + 1));
    if (begin == line.npos) begin = std::min(line.rfind(' '), line.size());
    const std::size_t end = line.find(' ', std::min(begin + 1, line.size()));
    const std::string word = random_.OneIn(4) ? "" : " '" + random_.Of(TheWorld().values) + '\'';
    line.replace(begin, end == line.npos ? end : end - begin, word);
  }

  fuzz::Random random_;
};

}  // namespace

extern "C" std::size_t LLVMFuzzerCustomMutator(std::uint8_t* data, std::size_t size, std::size_t room,
                                               unsigned seed) {
  if (seed % 4 == 0) return LLVMFuzzerMutate(data, size, room);
  const std::string text(reinterpret_cast<const char*>(data), size);
  std::vector<std::string> lines = fuzz::Lines(text);
  Mutator(seed).Change(lines);
  std::string changed;
  for (const std::string& line : lines) changed += line + '\n';
  return fuzz::HandOver(changed, data, room);
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static host::Store& store = [&]() -> host::Store& {
    host::Host::Use(simulator::HostOf(TheWorld().description));
    host::SetTraceSink([](const std::string&) {});
    host::Host::Current().GetStore().Execute("CREATE TABLE saved AS SELECT * FROM object");
    return host::Host::Current().GetStore();
  }();
  static std::int64_t changes = store.Number("SELECT total_changes()");

  std::vector<std::string> lines = fuzz::Lines(std::string(reinterpret_cast<const char*>(data), size));
  lines.resize(std::min(lines.size(), kMostLines));
  for (const std::string& line : lines) Run(line);
  std::filesystem::remove_all(fuzz::TemporaryRoot() + "/etc");
  if (store.Number("SELECT total_changes()") == changes) return 0;
  // It takes longer than most commands, so not every input is held to it. Which are must not depend on
  // others.
  if (size % 4 == 0) fuzz::RequireThatItReloads(host::Host::Current());
  store.Execute(
      "DELETE FROM object; INSERT INTO object SELECT * FROM saved;"
      " UPDATE sqlite_sequence SET seq = (SELECT max(id) FROM object)");
  changes = store.Number("SELECT total_changes()");
  return 0;
}
