#include "plinth/Console.h"

#include <signal.h>
#include <termios.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

namespace Plinth {

Sink::~Sink() = default;
Console::~Console() = default;

FileSink::~FileSink() { FileSink::Flush(); }

void FileSink::Write(std::string_view text) {
  while (!text.empty()) {
    const std::size_t part = text.copy(buffer_.data() + used_, buffer_.size() - used_);
    used_ += part;
    text.remove_prefix(part);
    if (used_ == buffer_.size()) Flush();
  }
}

int FileSink::Flush() {
  std::size_t done = 0;
  while (done < used_ && error_ == 0) {
    const ssize_t written = write(descriptor_, buffer_.data() + done, used_ - done);
    if (written >= 0) {
      done += static_cast<std::size_t>(written);
    } else if (errno != EINTR) {
      error_ = errno;
    }
  }
  used_ = 0;
  return error_;
}

namespace {

constexpr int kEndingSignals[] = {SIGHUP, SIGINT, SIGQUIT, SIGTERM};

// Only one secret is read at a time.
volatile sig_atomic_t caughtSignal = 0;

void CatchSignal(int number) { caughtSignal = number; }

/// Keeps a terminal from echoing. On every way out, a signal included, the terminal is as it was.
class NoEcho {
 public:
  NoEcho() {
    if (tcgetattr(STDIN_FILENO, &before_) != 0) return;
    isTerminal_ = true;
    caughtSignal = 0;
    // No SA_RESTART: the read has to come back to be given up.
    struct sigaction action = {};
    action.sa_handler = CatchSignal;
    for (std::size_t index = 0; index < std::size(kEndingSignals); ++index) {
      sigaction(kEndingSignals[index], &action, &actions_[index]);
    }
    termios quiet = before_;
    quiet.c_lflag &= ~static_cast<tcflag_t>(ECHO);
    tcsetattr(STDIN_FILENO, TCSAFLUSH, &quiet);
  }
  NoEcho(const NoEcho&) = delete;
  NoEcho& operator=(const NoEcho&) = delete;
  ~NoEcho() {
    if (!isTerminal_) return;
    tcsetattr(STDIN_FILENO, TCSAFLUSH, &before_);
    for (std::size_t index = 0; index < std::size(kEndingSignals); ++index) {
      sigaction(kEndingSignals[index], &actions_[index], nullptr);
    }
    if (caughtSignal != 0) raise(caughtSignal);
  }

  bool IsTerminal() const { return isTerminal_; }

 private:
  bool isTerminal_ = false;
  termios before_ = {};
  struct sigaction actions_[std::size(kEndingSignals)] = {};
};

}  // namespace

bool ProcessConsole::ReadSecret(const std::string& name, std::string& line) {
  const NoEcho noEcho;
  if (noEcho.IsTerminal()) {
    error_.Write(name + ": ");
    error_.Flush();
  }
  line.clear();
  bool begun = false;
  // Byte by byte: what stands behind the line is not ours.
  for (char byte = 0;;) {
    const ssize_t count = read(STDIN_FILENO, &byte, 1);
    if (count < 0 && errno == EINTR && caughtSignal == 0) continue;
    if (count <= 0) break;
    begun = true;
    if (byte == '\n') break;
    line += byte;
  }
  if (noEcho.IsTerminal()) {
    error_.Write("\n");
    error_.Flush();
  }
  return begun;
}

bool TextConsole::ReadSecret(const std::string&, std::string& line) {
  if (input.empty()) return false;
  const std::size_t end = input.find('\n');
  line = input.substr(0, end);
  input.erase(0, end == input.npos ? end : end + 1);
  return true;
}

}  // namespace Plinth
