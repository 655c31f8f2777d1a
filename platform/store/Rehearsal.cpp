#include "store/Rehearsal.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>

#include "store/Files.h"

namespace store {

std::unique_ptr<Rehearsal> Rehearsal::current;

void Rehearsal::WriteFile(const std::string& path, const std::string& contents) {
  if (faccessat(AT_FDCWD, NearestFolder(path).c_str(), W_OK | X_OK, AT_EACCESS) != 0) {
    FailFile(path, "written", errno);
  }
  files_[path] = contents;
  ++fileChanges_;
}

const std::string* Rehearsal::FindFile(const std::string& path) const {
  const auto file = files_.find(path);
  return file == files_.end() ? nullptr : &file->second;
}

}  // namespace store
