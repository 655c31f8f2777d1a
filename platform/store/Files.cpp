#include "store/Files.h"

#include <fcntl.h>
#include <stdio.h>
#include <stdlib.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <utility>

#include "store/Error.h"
#include "store/Rehearsal.h"

namespace store {

namespace {

std::string Folder(const std::string& path) {
  const std::size_t slash = path.rfind('/');
  return slash == path.npos ? "." : slash == 0 ? "/" : path.substr(0, slash);
}

/// What is to take the place of @p path is made under this name.
std::string TemporaryOf(const std::string& path) {
  const std::size_t slash = path.rfind('/') + 1;
  return path.substr(0, slash) + "." + path.substr(slash) + ".new";
}

/// Whether the open file @p file still goes by the name @p path.
bool IsNamed(int file, const std::string& path) {
  struct stat own;
  struct stat named;
  return fstat(file, &own) == 0 && lstat(path.c_str(), &named) == 0 && own.st_dev == named.st_dev &&
         own.st_ino == named.st_ino;
}

}  // namespace

namespace {

int patience = kPatienceMilliseconds;

}  // namespace

int Patience() { return patience; }

int SetPatience(int milliseconds) { return std::exchange(patience, milliseconds); }

std::string HostPath(std::string_view path) {
  const char* variable = getenv("HCLI_ROOT");
  if (variable != nullptr && *variable == '\0') {
    throw Error(
        Error::Kind::Invalid,
        "HCLI_ROOT is empty: set it to the folder that stands for \"/\", or unset it for this machine's"
        " own files.");
  }
  std::string root = variable == nullptr ? "" : variable;
  while (!root.empty() && root.back() == '/') root.pop_back();
  return root.append(path);
}

void FailFile(const std::string& path, const char* what, int error) {
  throw Error(Error::KindOfSystem(error),
              "The file " + path + " cannot be " + what + ": " + strerror(error) + ".");
}

std::string NearestFolder(std::string path) {
  do {
    path.erase(path.find_last_of('/') + 1);
    while (path.size() > 1 && path.back() == '/') path.pop_back();
  } while (!path.empty() && faccessat(AT_FDCWD, path.c_str(), F_OK, AT_EACCESS) != 0 && errno == ENOENT);
  return path.empty() ? "." : path;
}

void MakeFoldersFor(const std::string& path) {
  const std::string folder = Folder(path);
  struct stat status;
  if (stat(folder.c_str(), &status) == 0) return;  // what is no folder fails where it is used
  if (folder != "/" && folder != ".") MakeFoldersFor(folder);
  if (mkdir(folder.c_str(), 0755) != 0) {
    if (errno == EEXIST) return;
    throw Error(Error::KindOfSystem(errno),
                "The folder " + folder + " cannot be made: " + strerror(errno) + ".");
  }
  // The umask may keep others out, but not the owner.
  if (stat(folder.c_str(), &status) == 0 && (status.st_mode & S_IRWXU) != S_IRWXU) {
    chmod(folder.c_str(), (status.st_mode & 07777) | S_IRWXU);
  }
}

bool IsRegularFile(const char* what, const std::string& path, struct stat& status) {
  const auto refuse = [&](Error::Kind kind, const std::string& reason) {
    throw Error(kind, what + (" " + path) + reason);
  };
  if (const Rehearsal* rehearsal = Rehearsal::Current(); rehearsal && rehearsal->FindFile(path)) {
    status = {};  // as no file is that was there before
    return true;
  }
  if (lstat(path.c_str(), &status) != 0) {
    if (errno == ENOENT) return false;
    refuse(Error::KindOfSystem(errno), std::string(" cannot be opened: ") + strerror(errno) + ".");
  }
  if (S_ISLNK(status.st_mode)) refuse(Error::Kind::Denied, " is a symbolic link, and that is not followed.");
  if (!S_ISREG(status.st_mode)) refuse(Error::Kind::Denied, " is not a regular file.");
  return true;
}

namespace {

[[noreturn]] void FailRead(const std::string& name, int error) {
  throw Error(Error::KindOfSystem(error), name + " cannot be read: " + strerror(error) + ".");
}

/// Reads the open file @p file, which errors call @p name, from where it stands to its end.
void ReadRest(int file, const std::string& name, std::size_t most, std::string& contents) {
  const auto requireMost = [&](std::size_t size) {
    if (size <= most) return;
    throw Error(Error::Kind::OutOfRange,
                name + " has more than " + std::to_string(most) + " bytes, the most that can be read.");
  };
  contents.clear();
  struct stat status;
  if (fstat(file, &status) == 0 && S_ISREG(status.st_mode)) {
    const off_t rest = std::max<off_t>(status.st_size - std::max<off_t>(lseek(file, 0, SEEK_CUR), 0), 0);
    requireMost(static_cast<std::size_t>(rest));
    contents.reserve(static_cast<std::size_t>(rest));
  }
  char buffer[16384];
  ssize_t size;
  while ((size = read(file, buffer, sizeof buffer)) > 0 || (size < 0 && errno == EINTR)) {
    if (size > 0) contents.append(buffer, static_cast<std::size_t>(size));
    requireMost(contents.size());
  }
  if (size < 0) FailRead(name, errno);
}

bool ReadWhole(const std::string& path, int flags, std::size_t most, std::string& contents) {
  const std::string name = "The file " + path;
  const int file = open(path.c_str(), O_RDONLY | O_CLOEXEC | flags);
  if (file < 0 && errno == ENOENT) return false;
  if (file < 0) FailRead(name, errno);
  try {
    ReadRest(file, name, most, contents);
  } catch (...) {
    close(file);
    throw;
  }
  close(file);
  return true;
}

}  // namespace

bool ReadFile(const std::string& path, std::size_t most, std::string& contents) {
  return ReadWhole(path, 0, most, contents);
}

void ReadStandardInput(std::size_t most, std::string& contents) {
  ReadRest(STDIN_FILENO, "Standard input", most, contents);
}

bool ReadHostFile(const std::string& path, std::string& contents) {
  if (const Rehearsal* rehearsal = Rehearsal::Current()) {
    if (const std::string* written = rehearsal->FindFile(path)) {
      contents = *written;
      return true;
    }
  }
  struct stat status;
  return IsRegularFile("The file", path, status) &&
         ReadWhole(path, O_NOFOLLOW | O_NONBLOCK, std::string().max_size(), contents);
}

/// Waits until no other process has the open file @p file locked, and locks it; closed where that fails.
void NewFile::Lock(int file) {
  for (int waited = 0; flock(file, LOCK_EX | LOCK_NB) != 0; waited += kPauseMilliseconds) {
    const int error = errno;
    if (error == EWOULDBLOCK && waited < patience) {
      usleep(kPauseMilliseconds * 1000);
      continue;
    }
    close(file);
    if (error != EWOULDBLOCK) FailFile(path_, "locked", error);
    throw Error(Error::Kind::Busy, "The file " + path_ + " is locked by another process.");
  }
}

NewFile::NewFile(const std::string& path) : path_(path), temporary_(TemporaryOf(path)) {
  while (true) {
    file_ = open(temporary_.c_str(), O_RDWR | O_CREAT | O_EXCL | O_CLOEXEC, 0600);
    if (file_ < 0) {
      if (errno != EEXIST) FailFile(path_, "written", errno);
      ClearTemporary();
      continue;
    }
    fchmod(file_, 0600);
    Lock(file_);
    if (IsNamed(file_, temporary_)) return;
    close(file_);  // taken for a file left behind before it was locked
  }
}

/// Waits for the process that is at work on the file, or clears away what one left that was killed.
void NewFile::ClearTemporary() {
  struct stat status;
  if (!IsRegularFile("The file", temporary_, status)) return;
  const int file = open(temporary_.c_str(), O_RDONLY | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC);
  if (file < 0 && errno == ENOENT) return;
  // One's own file without the right to read it was left before its mode was set.
  const bool unreadable = file < 0 && errno == EACCES && status.st_uid == geteuid();
  if (file < 0 && !unreadable) FailFile(temporary_, "opened", errno);
  if (file >= 0) Lock(file);
  const int error =
      (unreadable || IsNamed(file, temporary_)) && unlink(temporary_.c_str()) != 0 && errno != ENOENT ? errno
                                                                                                      : 0;
  if (file >= 0) close(file);
  if (error != 0) FailFile(temporary_, "removed", error);
}

NewFile::~NewFile() {
  // Its name goes while the lock still keeps others from making theirs.
  if (!temporary_.empty()) unlink(temporary_.c_str());
  close(file_);
}

void NewFile::Write(std::string_view bytes) {
  while (!bytes.empty()) {
    const ssize_t size = write(file_, bytes.data(), bytes.size());
    if (size < 0 && errno == EINTR) continue;
    if (size < 0) FailFile(path_, "written", errno);
    bytes.remove_prefix(static_cast<std::size_t>(size));
  }
}

void NewFile::SetOwnerAndMode(uid_t owner, gid_t group, mode_t mode) {
  struct stat status;
  if (fstat(file_, &status) != 0) FailFile(path_, "written", errno);
  if ((status.st_uid != owner || status.st_gid != group) && fchown(file_, owner, group) != 0) {
    FailFile(path_, "given to its owner", errno);
  }
  if (fchmod(file_, mode & 07777) != 0) FailFile(path_, "given its mode", errno);
}

void NewFile::Sync() {
  if (fsync(file_) != 0) FailFile(path_, "written", errno);
}

void NewFile::SyncFolder() {
  const int folder = open(Folder(path_).c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
  // A folder that may be written but not read is synced with all else on its file system.
  const bool isDone = folder >= 0 ? fsync(folder) == 0 : errno == EACCES && syncfs(file_) == 0;
  const int error = errno;
  if (folder >= 0) close(folder);
  if (isDone || error == EINVAL) return;  // which a file system says that knows no such thing
  throw Error(
      Error::KindOfSystem(error),
      "The file " + path_ + " is in its place, but its folder cannot be synced: " + strerror(error) + ".");
}

void NewFile::Replace() {
  Sync();
  if (rename(temporary_.c_str(), path_.c_str()) != 0) FailFile(path_, "written", errno);
  temporary_.clear();
  SyncFolder();
}

bool NewFile::Publish() {
  Sync();
  const auto errorOf = [](int result) { return result == 0 ? 0 : errno; };
  int error = errorOf(renameat2(AT_FDCWD, temporary_.c_str(), AT_FDCWD, path_.c_str(), RENAME_NOREPLACE));
  if (error == 0) temporary_.clear();
  // Some file systems know only the other way.
  if (error == EINVAL || error == ENOSYS) error = errorOf(link(temporary_.c_str(), path_.c_str()));
  if (error == EEXIST) return false;
  if (error != 0) FailFile(path_, "written", error);
  SyncFolder();
  return true;
}

void ClearLeftover(const std::string& path) {
  const std::string temporary = TemporaryOf(path);
  const int file = open(temporary.c_str(), O_RDONLY | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC);
  if (file < 0) return;
  struct stat status;
  const bool isRegular = fstat(file, &status) == 0 && S_ISREG(status.st_mode);
  if (isRegular && flock(file, LOCK_EX | LOCK_NB) == 0 && IsNamed(file, temporary)) unlink(temporary.c_str());
  close(file);
}

void KeepPrivate(const std::string& path, const struct stat& status) {
  if ((status.st_mode & 07777 & ~0600u) == 0) return;
  const int file = open(path.c_str(), O_RDONLY | O_NOFOLLOW | O_NONBLOCK | O_CLOEXEC);
  if (file < 0) return;
  fchmod(file, status.st_mode & 0600);
  close(file);
}

}  // namespace store
