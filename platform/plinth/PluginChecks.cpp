#include <fcntl.h>
#include <poll.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstring>

#include "plinth/Declarations.h"
#include "plinth/Guide.h"
#include "plinth/Loader.h"
#include "plinth/OwnChecks.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

using AutoCli::Namespace;
using std::chrono::steady_clock;

constexpr std::chrono::seconds kMostTime{5};
constexpr char kDone = '\0';  // stands behind what the child has to say

/// The child: says what became of the plug-in, and ends without more ado.
[[noreturn]] void TakeInAndTell(Namespace& root, const PluginPlace& place, const std::string& name,
                                int pipe) {
  // What the plug-in writes meanwhile is no part of our output.
  const int nowhere = open("/dev/null", O_RDWR | O_CLOEXEC);
  for (int standard = 0; standard < 3; ++standard) dup2(nowhere, standard);
  std::string text;
  try {
    text = TakeInPlugin(root, place, name);
  } catch (const std::bad_alloc&) {
    text = "out of memory";
  }
  text += kDone;
  const ssize_t written = write(pipe, text.data(), text.size());
  _exit(written == static_cast<ssize_t>(text.size()) ? 0 : 1);
}

/// Reads until the writers have gone. False where the time is over before.
bool ReadAll(int pipe, std::string& text) {
  const auto end = steady_clock::now() + kMostTime;
  for (;;) {
    const auto left = std::chrono::duration_cast<std::chrono::milliseconds>(end - steady_clock::now());
    pollfd waited{pipe, POLLIN, 0};
    const int ready = poll(&waited, 1, static_cast<int>(std::max<long long>(left.count(), 0)));
    if (ready == 0) return false;
    char buffer[4096];
    const ssize_t count = ready > 0 ? read(pipe, buffer, sizeof buffer) : -1;
    if (count == 0) return true;
    if (count > 0) text.append(buffer, static_cast<std::size_t>(count));
    if (count > 0 && text.back() == kDone)
      return true;  // a process that it has left behind is not waited for
    if (count < 0 && errno != EINTR) return true;
  }
}

/// What TakeInPlugin says in a process of its own, which a plug-in may crash or never come back from.
std::string TryApart(Namespace& root, const PluginPlace& place, const std::string& name) {
  const std::string leftOut = "plug-in " + Quoted(place.folder + '/' + name) + " cannot be used: ";
  int ends[2];
  if (pipe2(ends, O_CLOEXEC) != 0) return leftOut + "no pipe: " + std::strerror(errno);
  const pid_t child = fork();
  if (child == 0) TakeInAndTell(root, place, name, ends[1]);
  close(ends[1]);
  std::string text;
  const bool isInTime = child != -1 && ReadAll(ends[0], text);
  close(ends[0]);
  if (child == -1) return leftOut + "no process to try it in: " + std::strerror(errno);
  if (!isInTime) kill(child, SIGKILL);
  int status = 0;
  while (waitpid(child, &status, 0) == -1 && errno == EINTR) {
  }
  if (!isInTime) return leftOut + "it does not come back from being loaded";
  if (!text.empty() && text.back() == kDone) return text.substr(0, text.size() - 1);
  if (!WIFSIGNALED(status)) return leftOut + "it ends the program while it is loaded";
  return leftOut + "it crashes while it is loaded: " + strsignal(WTERMSIG(status));
}

std::string NamesUnder(const Namespace& root, const std::string& plugin) {
  std::vector<std::string> names;
  for (const AutoCli::Child& child : AutoCli::NodeData::Of(root).children) {
    if (AutoCli::NodeData::Of(*child.node).plugin == plugin) names.push_back(child.name);
  }
  return Join(names, ", ");
}

}  // namespace

void CheckPlugins(Namespace& root, std::vector<Finding>& findings) {
  const PluginPlace* const place = PluginPlaceInUse();
  if (!place) return;  // a program that brings its commands itself
  const std::string folder = Quoted(place->folder);
  std::vector<std::string> names;
  if (const std::string trouble = FindPlugins(*place, names); !trouble.empty()) {
    findings.push_back({"plug-in folder", FindingState::Fault, trouble,
                        "Name another with --plugins or HCLI_PLUGINS, or install hcli anew."});
  } else if (names.empty()) {
    findings.push_back({"plug-in folder", FindingState::Fault, "There is no plug-in in " + folder + '.',
                        "Name another with --plugins or HCLI_PLUGINS, or install hcli anew."});
  } else {
    findings.push_back({"plug-in folder", FindingState::Ok, folder + " can be read.", ""});
  }
  for (const std::string& name : names) {
    std::string trouble = TryApart(root, *place, name);
    if (trouble.empty()) trouble = TakeInPlugin(root, *place, name);
    if (trouble.empty()) {
      const std::string commands = NamesUnder(root, name.substr(0, name.size() - 3));
      findings.push_back({"plug-in " + Visible(name), FindingState::Ok, "It brings: " + commands + '.', ""});
    } else {
      findings.push_back({"plug-in " + Visible(name), FindingState::Fault, trouble,
                          "Install that plug-in anew, or take its file away."});
    }
  }
}

void CheckGuides(std::vector<Finding>& findings) {
  const std::vector<std::string> faults = GuideFaults();
  for (const std::string& fault : faults) {
    findings.push_back({"guide file", FindingState::Warning, "Help lacks what it holds: " + fault,
                        "Install that plug-in anew."});
  }
  if (faults.empty()) {
    findings.push_back(
        {"guide files", FindingState::Ok, std::to_string(GuideFiles().size()) + " can be read.", ""});
  }
}

}  // namespace Plinth
