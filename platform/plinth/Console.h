/// Where a run reads and writes: a seam, so that a test can run a command line in its own process.
#pragma once

#include <array>
#include <cstddef>
#include <string>
#include <string_view>

#pragma GCC visibility push(default)

namespace Plinth {

/// Takes text in order.
class Sink {
 public:
  Sink() = default;
  Sink(const Sink&) = delete;
  Sink& operator=(const Sink&) = delete;
  virtual ~Sink();

  virtual void Write(std::string_view text) = 0;
  /// Hands on what is still held. Returns the errno of the first write that failed, or 0.
  virtual int Flush() = 0;
};

/// Keeps the text.
class TextSink final : public Sink {
 public:
  void Write(std::string_view more) override { text += more; }
  int Flush() override { return 0; }

  std::string text;
};

/// Writes to a file descriptor, which the caller owns, through a small buffer.
class FileSink final : public Sink {
 public:
  explicit FileSink(int descriptor) : descriptor_(descriptor) {}
  ~FileSink() override;

  void Write(std::string_view text) override;
  int Flush() override;

 private:
  int descriptor_;
  int error_ = 0;
  std::size_t used_ = 0;
  std::array<char, 8192> buffer_;
};

/// In characters; zeros where there is no terminal, or one that does not tell.
struct ScreenSize {
  std::size_t columns = 0;
  std::size_t rows = 0;
};

class Console {
 public:
  Console() = default;
  Console(const Console&) = delete;
  Console& operator=(const Console&) = delete;
  virtual ~Console();

  virtual Sink& Out() = 0;
  virtual Sink& Error() = 0;
  /// False where whoever was to read standard output has gone.
  virtual bool HasReader() const = 0;
  /// Reads one line, without its newline, that must not be shown. @p name tells the user what is asked for.
  /// False where the input ended before a line began.
  virtual bool ReadSecret(const std::string& name, std::string& line) = 0;
  /// True where a person is asked for secrets, rather than that they come from a pipe or a file.
  virtual bool IsAsking() const = 0;
  /// True where a person sees standard error.
  virtual bool IsErrorTerminal() const = 0;
  /// The terminal on which a person sees standard output.
  virtual ScreenSize OutScreen() const = 0;
};

/// The three standard files of the process.
class ProcessConsole final : public Console {
 public:
  Sink& Out() override { return out_; }
  Sink& Error() override { return error_; }
  bool HasReader() const override;
  bool ReadSecret(const std::string& name, std::string& line) override;
  bool IsAsking() const override;
  bool IsErrorTerminal() const override;
  ScreenSize OutScreen() const override;

 private:
  FileSink out_{1};
  FileSink error_{2};
};

/// Keeps what is written and answers from a text. For tests.
class TextConsole final : public Console {
 public:
  Sink& Out() override { return out; }
  Sink& Error() override { return error; }
  bool HasReader() const override { return true; }
  bool ReadSecret(const std::string& name, std::string& line) override;
  bool IsAsking() const override { return isTerminal; }
  bool IsErrorTerminal() const override { return isTerminal; }
  ScreenSize OutScreen() const override { return screen; }

  /// What is read and written counts as a person's.
  bool isTerminal = false;
  ScreenSize screen;
  TextSink out;
  TextSink error;
  /// What is left to read.
  std::string input;
};

}  // namespace Plinth

#pragma GCC visibility pop
