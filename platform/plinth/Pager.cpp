#include <fcntl.h>
#include <signal.h>
#include <spawn.h>
#include <stdlib.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>

#include "plinth/Run.h"
#include "plinth/Text.h"
#include "plinth/Tty.h"

extern char** environ;

namespace Plinth {

namespace {

/// Says by its status, as a shell does, that there is no such program.
constexpr const char* kUsualPager = "command -v less >/dev/null || exit 127; exec less";

/// Empty for none.
std::string PagerCommand() {
  const char* named = getenv("HCLI_PAGER");
  if (!named) named = getenv("PAGER");
  const std::string command = named ? named : kUsualPager;
  return command == "cat" || command.find_first_not_of(" \t") == command.npos ? "" : command;
}

bool Fits(const std::string& text, const ScreenSize& screen) {
  std::size_t rows = 1;  // the one of the next prompt
  for (const std::string& line : Split(text, '\n')) {
    const std::size_t width = DisplayWidth(line);
    rows += width == 0 ? 1 : (width - 1) / screen.columns + 1;
    if (rows > screen.rows + 1) return false;  // behind the last line break stands an empty part
  }
  return true;
}

/// Keys that end programs are for the pager, for as long as this lives.
class KeysForThePager {
 public:
  KeysForThePager() : interrupt_(signal(SIGINT, SIG_IGN)), quit_(signal(SIGQUIT, SIG_IGN)) {}
  KeysForThePager(const KeysForThePager&) = delete;
  KeysForThePager& operator=(const KeysForThePager&) = delete;
  ~KeysForThePager() {
    signal(SIGINT, interrupt_);
    signal(SIGQUIT, quit_);
  }

 private:
  sighandler_t interrupt_;
  sighandler_t quit_;
};

/// Starts the shell's @p command with @p input to read; 0 where that cannot be.
pid_t Start(const std::string& command, int input) {
  posix_spawn_file_actions_t files;
  posix_spawnattr_t attributes;
  if (posix_spawn_file_actions_init(&files) != 0) return 0;
  if (posix_spawnattr_init(&attributes) != 0) {
    posix_spawn_file_actions_destroy(&files);
    return 0;
  }
  sigset_t usual;
  sigemptyset(&usual);
  for (const int number : {SIGINT, SIGQUIT, SIGPIPE, SIGXFSZ}) sigaddset(&usual, number);
  posix_spawnattr_setsigdefault(&attributes, &usual);
  posix_spawnattr_setflags(&attributes, POSIX_SPAWN_SETSIGDEF);
  posix_spawn_file_actions_adddup2(&files, input, STDIN_FILENO);
  const char* const words[] = {"sh", "-c", command.c_str(), nullptr};
  pid_t pid = 0;
  const int error = posix_spawn(&pid, "/bin/sh", &files, &attributes, const_cast<char**>(words), environ);
  posix_spawnattr_destroy(&attributes);
  posix_spawn_file_actions_destroy(&files);
  return error == 0 ? pid : 0;
}

/// Somebody who has seen enough ends the pager ahead of the end: that is no failure.
void Feed(int descriptor, std::string_view text) {
  while (!text.empty()) {
    const ssize_t written = write(descriptor, text.data(), text.size());
    if (written < 0 && errno != EINTR) return;
    if (written > 0) text.remove_prefix(static_cast<std::size_t>(written));
  }
}

/// False where there was no pager to show it in.
bool ShowInPager(const std::string& command, const std::string& text) {
  int ends[2];
  if (pipe2(ends, O_CLOEXEC) != 0) return false;
  // less ends by itself where one screen is enough, shows colours, and leaves what it showed.
  setenv("LESS", "FRX", 0);
  setenv("LV", "-c", 0);
  const KeysForThePager keys;
  const pid_t pager = Start(command, ends[0]);
  close(ends[0]);
  if (pager != 0) Feed(ends[1], text);
  close(ends[1]);
  if (pager == 0) return false;
  int status = 0;
  while (waitpid(pager, &status, 0) == -1 && errno == EINTR) {
  }
  // What a shell tells of a program that it cannot find or start.
  return !(WIFEXITED(status) && (WEXITSTATUS(status) == 126 || WEXITSTATUS(status) == 127));
}

}  // namespace

bool MayPage(const Run& run) {
  const ScreenSize screen = run.console.OutScreen();
  return screen.columns != 0 && screen.rows != 0 && run.line == 0 && !IsDumbTerminal() &&
         !run.request.global.For("no-pager").truth && !PagerCommand().empty();
}

void WritePaged(const Run& run, const std::string& text) {
  if (Fits(text, run.console.OutScreen()) || !ShowInPager(PagerCommand(), text)) {
    run.console.Out().Write(text);
  }
}

}  // namespace Plinth
