/// Utilities of the storage control library.
#pragma once

#include <NodeCtl/Exception.h>

#include <memory>
#include <string>
#include <vector>

namespace CoreCtl::Util {

/// Deletes every element of @p elements, of which any may be null, and empties it.
template <class T>
void DeleteVector(std::vector<T*>& elements) {
  for (T* element : elements) delete element;
  elements.clear();
}

/// A file of lines NAME=VALUE, as shells read it. Comments, empty lines, the order of the lines and variables
/// that are not set here survive a Parse, Set and Save.
///
/// Operations throw NodeCtl::Lib::NodeCtlException, with the file and the reason in the text.
class __attribute__((visibility("default"))) EnvironmentVarFile {
 public:
  /// Stands for the file @p path, an absolute path on the host. Nothing is opened.
  explicit EnvironmentVarFile(std::string path);
  EnvironmentVarFile(const EnvironmentVarFile&) = delete;
  EnvironmentVarFile& operator=(const EnvironmentVarFile&) = delete;
  ~EnvironmentVarFile();

  /// Reads the file. A file that does not exist reads as empty. A line that is no comment, not empty and
  /// no assignment is refused, and the object then stays as it was.
  void Parse();
  /// Sets @p name, in memory only, wherever the file has it, or else at the end. A value of any bytes but NUL
  /// and line breaks can be stored, without quotes of the caller's: it is quoted as needed. A name that is no
  /// shell identifier, or another value, is refused.
  void Set(std::string name, std::string value);
  /// Replaces the file at once: whoever reads it sees the old or the new contents, whole. Owner and mode of
  /// an existing file are kept, and missing folders made. When it throws, the file is as it was.
  void Save();

 private:
  struct State;
  std::unique_ptr<State> state_;
};

}  // namespace CoreCtl::Util
