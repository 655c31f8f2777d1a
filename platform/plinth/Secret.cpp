#include <signal.h>
#include <termios.h>
#include <unistd.h>

#include <cerrno>

#include "plinth/Console.h"

namespace Plinth {

namespace {

// Only one secret is read at a time, and signal handlers can get at nothing but what is static.
volatile sig_atomic_t isReading = 0;
/// The terminal is as somebody else has set it: not yet taken, or left to whoever stopped the process.
volatile sig_atomic_t isAway = 1;
termios echoing;
const char* prompt;
struct sigaction actionsBefore[NSIG];

/// A shell lends the terminal to one process group at a time; in any other, setting it would stop the
/// process.
bool HasTerminal() {
  const pid_t group = tcgetpgrp(STDIN_FILENO);
  return group == -1 || group == getpgrp();
}

// What the user has typed is dropped with each change: half a secret must not become the shell's input.
void SetTerminal(const termios& mode) {
  tcsetattr(STDIN_FILENO, TCSANOW, &mode);
  tcflush(STDIN_FILENO, TCIFLUSH);
}

void Say(const char* text) {
  const char* end = text;
  while (*end) ++end;
  // Where even this cannot be written there is nobody to tell.
  [[maybe_unused]] const ssize_t written = write(STDERR_FILENO, text, static_cast<std::size_t>(end - text));
}

/// Takes the terminal as it is now: a shell that has begun the program in the background may have had it in a
/// mode of its own then.
void Ask() {
  if (!HasTerminal()) return;
  if (isAway) tcgetattr(STDIN_FILENO, &echoing);
  isAway = 0;
  termios quiet = echoing;
  quiet.c_lflag &= ~static_cast<tcflag_t>(ECHO);
  SetTerminal(quiet);
  Say(prompt);
}

void Leave() {
  if (isAway) return;
  SetTerminal(echoing);
  isAway = 1;
  Say("\n");
}

/// Ends or stops the process as the signal would have done, with a terminal that echoes. For the fault of an
/// instruction too, since the signal is raised anew. All other signals wait meanwhile: one that is not caught
/// at the time would leave the terminal as it is.
void LeaveTerminal(int number) {
  const int error = errno;
  Leave();
  struct sigaction ours;
  sigaction(number, &actionsBefore[number], &ours);
  raise(number);
  sigset_t one;
  sigemptyset(&one);
  sigaddset(&one, number);
  sigprocmask(SIG_UNBLOCK, &one, nullptr);  // it strikes here
  sigprocmask(SIG_BLOCK, &one, nullptr);
  sigaction(number, &ours, nullptr);
  // Going on after a stop, SIGCONT asks anew. But without a shell around it, nothing has stopped.
  sigset_t waiting;
  sigpending(&waiting);
  if (isReading && !sigismember(&waiting, SIGCONT)) Ask();
  errno = error;
}

void ComeBack(int) {
  const int error = errno;
  if (isReading) Ask();
  errno = error;
}

bool IsHarmless(int number) { return number == SIGCHLD || number == SIGURG || number == SIGWINCH; }

/// Keeps a terminal from echoing, and shows a prompt there. However the process ends or stops, the terminal
/// echoes as before; when it goes on, the prompt is back and the echo is off. Every signal that can be caught
/// is, but for those that do nothing.
class NoEcho {
 public:
  explicit NoEcho(const std::string& text) {
    if (!isatty(STDIN_FILENO)) return;
    isTerminal_ = true;
    prompt = text.c_str();
    for (int number = 1; number < NSIG; ++number) {
      if (IsHarmless(number)) continue;
      struct sigaction action = {};
      action.sa_handler = number == SIGCONT ? ComeBack : LeaveTerminal;
      action.sa_flags = SA_RESTART;
      sigfillset(&action.sa_mask);
      sigaction(number, nullptr, &actionsBefore[number]);
      if (actionsBefore[number].sa_handler != SIG_IGN) sigaction(number, &action, nullptr);
    }
    isReading = 1;
    Ask();
  }
  NoEcho(const NoEcho&) = delete;
  NoEcho& operator=(const NoEcho&) = delete;
  ~NoEcho() {
    if (!isTerminal_) return;
    isReading = 0;
    Leave();
    for (int number = 1; number < NSIG; ++number) {
      if (!IsHarmless(number)) sigaction(number, &actionsBefore[number], nullptr);
    }
  }

 private:
  bool isTerminal_ = false;
};

}  // namespace

bool ProcessConsole::ReadSecret(const std::string& name, std::string& line) {
  const std::string question = name + ": ";
  error_.Flush();
  const NoEcho noEcho(question);
  line.clear();
  bool begun = false;
  // Byte by byte: what stands behind the line is not ours.
  for (char byte = 0;;) {
    const ssize_t count = read(STDIN_FILENO, &byte, 1);
    if (count < 0 && errno == EINTR) continue;
    if (count <= 0) break;
    begun = true;
    if (byte == '\n') break;
    line += byte;
  }
  return begun;
}

}  // namespace Plinth
