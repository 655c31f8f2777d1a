/// What a dry run keeps in its own process: files that calls have written, the calls that changed something,
/// and the trace, which is shown when nobody is kept waiting any more.
///
/// The store has the rest: see Store::BeginRehearsal. Whatever reaches out of the process in another way has
/// to ask Current() first.
#pragma once

#include <map>
#include <memory>
#include <string>
#include <vector>

#pragma GCC visibility push(default)

namespace store {

class Rehearsal {
 public:
  /// Null where calls are for real.
  static Rehearsal* Current() { return current.get(); }
  static void Begin() { current = std::make_unique<Rehearsal>(); }
  static void End() noexcept { current.reset(); }

  /// The file @p path, which from now on reads so in this process. An Error where it could not be written:
  /// the folder that it, or a folder for it, would have to be made in is not the caller's to write to.
  void WriteFile(const std::string& path, const std::string& contents);
  /// What was written to @p path; null where nothing was.
  const std::string* FindFile(const std::string& path) const;
  int FileChanges() const { return fileChanges_; }

  std::vector<std::string> calls;
  std::vector<std::string> trace;

 private:
  static std::unique_ptr<Rehearsal> current;

  std::map<std::string, std::string> files_;
  int fileChanges_ = 0;
};

}  // namespace store

#pragma GCC visibility pop
