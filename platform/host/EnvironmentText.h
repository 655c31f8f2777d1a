/// The text of a file of NAME=VALUE lines.
#pragma once

#include <optional>
#include <string>
#include <string_view>
#include <vector>

#pragma GCC visibility push(default)

namespace host {

class EnvironmentText {
 public:
  /// Takes in a whole file. A line that is no comment, not empty and no assignment is a host::Error
  /// (DamagedFile), and the object then stays as it was.
  void Parse(std::string_view text);
  /// Replaces the value of every assignment to @p name, or adds one at the end. Refuses, as a host::Error, a
  /// name that is no shell identifier and a value that no line can hold.
  void Set(const std::string& name, const std::string& value);
  /// The value of the last assignment to @p name, unquoted.
  std::optional<std::string> Get(std::string_view name) const;
  std::string Text() const;

 private:
  struct Line {
    std::string before;  // blanks, and "export"; for a line without an assignment all of it
    std::string name;    // empty for a line without an assignment
    std::string value;   // as written, quotes included
    std::string after;   // what stands behind the value
    bool ends = true;    // false for a last line without a line break
  };
  static Line ParseLine(std::string_view text, std::size_t number);

  std::vector<Line> lines_;
};

}  // namespace host

#pragma GCC visibility pop
