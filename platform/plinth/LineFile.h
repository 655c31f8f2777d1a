/// A file that is read line by line, as it comes.
#pragma once

#include <array>
#include <cstddef>
#include <optional>
#include <string>

namespace Plinth {

/// While this object lives, who reads standard input finds it at its end.
class NoInput {
 public:
  NoInput();
  NoInput(const NoInput&) = delete;
  NoInput& operator=(const NoInput&) = delete;
  ~NoInput();

  /// The descriptor under which it can be read all the same; -1 where it is closed.
  int Kept() const { return kept_; }

 private:
  int kept_;
};

class LineFile {
 public:
  /// Bytes of a line, without its newline.
  static constexpr std::size_t kLongest = 1 << 20;

  /// "-" is standard input, which nobody else can read while this object lives. Throws UsageError where the
  /// file cannot be opened, or is a directory. A byte order mark at its beginning is passed over.
  explicit LineFile(const std::string& path);
  LineFile(const LineFile&) = delete;
  LineFile& operator=(const LineFile&) = delete;
  ~LineFile();

  /// As messages call it.
  const std::string& Name() const { return name_; }
  /// Reads the next line, without its newline; waits for no more than that. Of a line that is too long, gives
  /// kLongest bytes and one more, and waits for the others when it is called again. False at the end. Throws
  /// std::runtime_error where the line cannot be read.
  bool Next(std::string& line);
  /// True where the next line has been read already, with its newline.
  bool HasLine() const;
  /// The number of the line that was read last, from 1 on.
  std::size_t Number() const { return number_; }

 private:
  bool Fill();
  /// Takes what is read up to the next newline, and that: false where there is none.
  bool TakeUpToNewline(std::string* line);

  std::string name_;
  std::optional<NoInput> input_;
  int file_ = -1;
  std::size_t number_ = 0;
  std::array<char, 16384> buffer_;
  std::size_t begin_ = 0;
  std::size_t end_ = 0;
  /// The next bytes belong to a line that was too long.
  bool isInLongLine_ = false;
};

}  // namespace Plinth
