#include "plinth/LineFile.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <stdexcept>
#include <string_view>

#include "plinth/Options.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

/// What some editors begin every text with.
constexpr std::string_view kByteOrderMark = "\xef\xbb\xbf";

bool IsFolder(int file) {
  struct stat status = {};
  return fstat(file, &status) == 0 && S_ISDIR(status.st_mode);
}

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
  const int error = file_ < 0 ? errno : IsFolder(file_) ? EISDIR : 0;
  if (error == 0) return;
  if (!input_ && file_ >= 0) close(file_);
  throw UsageError("option --batch: " + Quoted(path) + " cannot be read: " + std::strerror(error));
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
  end_ = static_cast<std::size_t>(count);
  const bool isMarked = number_ == 0 && std::string_view(buffer_.data(), end_).starts_with(kByteOrderMark);
  begin_ = isMarked ? kByteOrderMark.size() : 0;
  return count > 0;
}

bool LineFile::HasLine() const {
  if (isInLongLine_) return false;
  const char* const last = buffer_.data() + end_;
  return std::find(buffer_.data() + begin_, last, '\n') != last;
}

bool LineFile::TakeUpToNewline(std::string* line) {
  const char* const first = buffer_.data() + begin_;
  const char* const last = buffer_.data() + end_;
  const char* const newline = std::find(first, last, '\n');
  if (line) line->append(first, newline);
  begin_ += static_cast<std::size_t>(newline - first) + (newline != last);
  return newline != last;
}

bool LineFile::Next(std::string& line) {
  line.clear();
  while (isInLongLine_ && (begin_ < end_ || Fill())) isInLongLine_ = !TakeUpToNewline(nullptr);
  bool begun = false;
  while (begin_ < end_ || Fill()) {
    if (!begun) ++number_;
    begun = true;
    const bool isWhole = TakeUpToNewline(&line);
    if (line.size() > kLongest) {
      line.resize(kLongest + 1);
      isInLongLine_ = !isWhole;
      return true;
    }
    if (isWhole) return true;
  }
  return begun;
}

}  // namespace Plinth
