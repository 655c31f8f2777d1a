#include "store/Rehearsal.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>

#include "store/Files.h"

namespace store {

std::unique_ptr<Rehearsal> Rehearsal::current;

void Rehearsal::WriteFile(const std::string& path, const std::string& contents) {
  std::string folder = path;
  do {
    folder.erase(folder.find_last_of('/') + 1);
    while (folder.size() > 1 && folder.back() == '/') folder.pop_back();
  } while (!folder.empty() && faccessat(AT_FDCWD, folder.c_str(), F_OK, AT_EACCESS) != 0 && errno == ENOENT);
  if (faccessat(AT_FDCWD, folder.empty() ? "." : folder.c_str(), W_OK | X_OK, AT_EACCESS) != 0) {
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
