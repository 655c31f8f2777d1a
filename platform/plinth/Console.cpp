#include "plinth/Console.h"

#include <poll.h>
#include <sys/ioctl.h>
#include <unistd.h>

#include <cerrno>

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

bool ProcessConsole::HasReader() const {
  pollfd out{STDOUT_FILENO, 0, 0};
  return poll(&out, 1, 0) <= 0 || (out.revents & (POLLERR | POLLHUP)) == 0;
}

bool ProcessConsole::IsAsking() const { return isatty(STDIN_FILENO) == 1; }
bool ProcessConsole::IsErrorTerminal() const { return isatty(STDERR_FILENO) == 1; }

ScreenSize ProcessConsole::OutScreen() const {
  winsize size{};
  if (ioctl(STDOUT_FILENO, TIOCGWINSZ, &size) != 0) return {};
  return {size.ws_col, size.ws_row};
}

bool TextConsole::ReadSecret(const std::string&, std::string& line) {
  if (input.empty()) return false;
  const std::size_t end = input.find('\n');
  line = input.substr(0, end);
  input.erase(0, end == input.npos ? end : end + 1);
  return true;
}

}  // namespace Plinth
