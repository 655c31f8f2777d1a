#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <set>
#include <string_view>

#include "plinth/Candidates.h"
#include "plinth/Formatter.h"
#include "plinth/Guide.h"
#include "plinth/Run.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

using std::chrono::steady_clock;

/// What a person takes for an answer at once.
constexpr std::chrono::milliseconds kLimit{200};

/// The child's part: runs the command, and writes value and description of each element, a zero byte behind
/// each.
void WriteValues(AutoCli::Namespace& root, const std::vector<std::string>& line, const ValueSource& source,
                 Sink& sink) noexcept {
  TextConsole console;
  Run run{ReadRequest(root, line), console, {.checked = false}};
  const KeyValues& marks = AutoCli::NodeData::Of(*run.request.node).metaData;
  const std::string* const type = FindValue(marks, "type");
  if (!type || *type != "fetcher" || !Prepare(run)) return;
  Perform(run);
  if (!run.record.result) return;
  std::set<std::string> known;
  ForEachElement(*run.record.result, [&](const MetaObj::MetaObject& element) {
    if (element.GetType() != MetaObj::MetaType::Struct) return;
    const Structure& row = Structure::Of(static_cast<const MetaObj::MetaStruct&>(element));
    const auto read = [&](const std::string& name) { return row.GetValue(row.GetShape().Find(name)); };
    std::string space;
    const Value field = read(source.field);
    const std::string value(ValueText(field, space));
    // What has to be shown in another form than it has cannot be written in a line.
    if (field.type == MetaObj::MetaType::String && field.text != value) return;
    if (value.empty() || !known.insert(value).second) return;
    sink.Write(value + '\0');
    if (!source.about.empty()) sink.Write(ValueText(read(source.about), space));
    sink.Write(std::string_view("", 1));
  });
}

/// All that comes before the other end is closed; nothing where that takes too long.
std::string ReadAll(int descriptor) {
  const auto end = steady_clock::now() + kLimit;
  std::string text;
  char buffer[16384];
  for (;;) {
    const auto left = std::chrono::ceil<std::chrono::milliseconds>(end - steady_clock::now()).count();
    pollfd wanted = {.fd = descriptor, .events = POLLIN, .revents = 0};
    if (left <= 0 || poll(&wanted, 1, static_cast<int>(left)) <= 0) return "";
    const ssize_t count = read(descriptor, buffer, sizeof buffer);
    if (count <= 0) return count == 0 ? text : "";
    text.append(buffer, static_cast<std::size_t>(count));
  }
}

/// What a child of this process writes in @p work: whatever befalls it, the process goes on in time. Of the
/// caller's files it has none, for which somebody might wait.
template <class Work>
std::string FromChild(Work work) {
  int ends[2];
  if (pipe2(ends, O_CLOEXEC) != 0) return "";
  const pid_t child = fork();
  if (child == 0) {
    const int nowhere = open("/dev/null", O_RDWR);
    for (int descriptor = 0; descriptor < 3; ++descriptor) dup2(nowhere, descriptor);
    FileSink sink(ends[1]);
    work(sink);
    sink.Flush();
    _exit(0);
  }
  close(ends[1]);
  std::string text = child == -1 ? "" : ReadAll(ends[0]);
  close(ends[0]);
  if (child == -1) return "";
  kill(child, SIGKILL);
  // One that a file system keeps from dying is left to whoever outlives this process.
  waitpid(child, nullptr, WNOHANG);
  return text;
}

}  // namespace

std::vector<Candidate> ShownValues(AutoCli::Namespace& root, const std::vector<std::string>& options,
                                   const ValueSource& source) {
  std::vector<std::string> line = {"--timeout=0", "--trace=no"};
  // Looking at a host may make one.
  if (CanRehearse()) line.emplace_back("--dry-run");
  for (std::string& word : Split(source.from, ' ')) line.push_back(std::move(word));
  line.insert(line.end(), options.begin(), options.end());
  const std::string text = FromChild([&](Sink& sink) { WriteValues(root, line, source, sink); });
  const std::vector<std::string> parts = Split(text, '\0');
  std::vector<Candidate> values;
  for (std::size_t at = 0; at + 1 < parts.size(); at += 2) values.push_back({parts[at], parts[at + 1]});
  return values;
}

}  // namespace Plinth
