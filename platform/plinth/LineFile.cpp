#include "plinth/LineFile.h"

#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <stdexcept>

#include "plinth/Options.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

constexpr std::size_t kMostOfLine = 1 << 20;

}  // namespace

NoInput::NoInput() : kept_(fcntl(STDIN_FILENO, F_DUPFD_CLOEXEC, 3)) {
  const int nothing = open("/dev/null", O_RDONLY | O_CLOEXEC);
  if (kept_ >= 0 && nothing >= 0) dup2(nothing, STDIN_FILENO);
  close(nothing);
}

NoInput::~NoInput() {
  dup2(kept_, STDIN_FILENO);
  close(kept_);
}

LineFile::LineFile(const std::string& path) : name_(path == "-" ? "standard input" : path) {
  if (path == "-") {
    file_ = input_.emplace().Kept();
  } else {
    file_ = open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NOCTTY);
  }
  if (file_ < 0)
    throw UsageError("option --batch: " + Quoted(path) + " cannot be read: " + std::strerror(errno));
}

LineFile::~LineFile() {
  if (!input_) close(file_);
}

/// Reads what is there by now; false at the end of the file.
bool LineFile::Fill() {
  ssize_t count;
  do {
    count = read(file_, buffer_.data(), buffer_.size());
  } while (count < 0 && errno == EINTR);
  if (count < 0) throw std::runtime_error(name_ + " cannot be read: " + std::strerror(errno));
  begin_ = 0;
  end_ = static_cast<std::size_t>(count);
  return count > 0;
}

bool LineFile::HasLine() const {
  const char* const last = buffer_.data() + end_;
  return std::find(buffer_.data() + begin_, last, '\n') != last;
}

bool LineFile::Next(std::string& line) {
  line.clear();
  bool begun = false;
  while (begin_ < end_ || Fill()) {
    if (!begun) ++number_;
    begun = true;
    const char* const first = buffer_.data() + begin_;
    const char* const last = buffer_.data() + end_;
    const char* const newline = std::find(first, last, '\n');
    line.append(first, newline);
    begin_ += static_cast<std::size_t>(newline - first) + (newline != last);
    if (newline != last) return true;
    if (line.size() > kMostOfLine) {
      throw std::runtime_error(name_ + ", line " + std::to_string(number_) + ": it is longer than " +
                               std::to_string(kMostOfLine) + " bytes");
    }
  }
  return begun;
}

}  // namespace Plinth
