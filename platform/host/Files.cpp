#include "host/Files.h"

#include <fcntl.h>
#include <stdio.h>
#include <stdlib.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>

#include "host/Error.h"

namespace host {

namespace {

std::string Folder(const std::string& path) {
  const std::size_t slash = path.rfind('/');
  return slash == path.npos ? "." : slash == 0 ? "/" : path.substr(0, slash);
}

}  // namespace

std::string HostPath(std::string_view path) {
  const char* variable = getenv("HCLI_ROOT");
  std::string root = variable == nullptr ? "" : variable;
  while (!root.empty() && root.back() == '/') root.pop_back();
  return root.append(path);
}

void FailFile(const std::string& path, const char* what, int error) {
  throw Error(Error::Kind::Failed, "The file " + path + " cannot be " + what + ": " + strerror(error) + ".");
}

void MakeFoldersFor(const std::string& path) {
  const std::string folder = Folder(path);
  struct stat status;
  if (stat(folder.c_str(), &status) == 0) return;  // what is no folder fails where it is used
  if (folder != "/" && folder != ".") MakeFoldersFor(folder);
  if (mkdir(folder.c_str(), 0755) != 0) {
    if (errno == EEXIST) return;
    throw Error(Error::Kind::Failed, "The folder " + folder + " cannot be made: " + strerror(errno) + ".");
  }
  // The umask may keep others out, but not the owner.
  if (stat(folder.c_str(), &status) == 0 && (status.st_mode & S_IRWXU) != S_IRWXU) {
    chmod(folder.c_str(), (status.st_mode & 07777) | S_IRWXU);
  }
}

bool IsRegularFile(const char* what, const std::string& path, struct stat& status) {
  const auto refuse = [&](const std::string& reason) {
    throw Error(Error::Kind::Failed, what + (" " + path) + reason);
  };
  if (lstat(path.c_str(), &status) != 0) {
    if (errno == ENOENT) return false;
    refuse(std::string(" cannot be opened: ") + strerror(errno) + ".");
  }
  if (S_ISLNK(status.st_mode)) refuse(" is a symbolic link, and that is not followed.");
  if (!S_ISREG(status.st_mode)) refuse(" is not a regular file.");
  return true;
}

namespace {

bool ReadWhole(const std::string& path, int flags, std::string& contents) {
  const int file = open(path.c_str(), O_RDONLY | O_CLOEXEC | flags);
  if (file < 0 && errno == ENOENT) return false;
  if (file < 0) FailFile(path, "read", errno);
  contents.clear();
  char buffer[16384];
  ssize_t size;
  while ((size = read(file, buffer, sizeof buffer)) > 0 || (size < 0 && errno == EINTR)) {
    if (size > 0) contents.append(buffer, static_cast<std::size_t>(size));
  }
  const int error = errno;
  close(file);
  if (size < 0) FailFile(path, "read", error);
  return true;
}

}  // namespace

bool ReadFile(const std::string& path, std::string& contents) { return ReadWhole(path, 0, contents); }

bool ReadHostFile(const std::string& path, std::string& contents) {
  struct stat status;
  return IsRegularFile("The file", path, status) && ReadWhole(path, O_NOFOLLOW | O_NONBLOCK, contents);
}

/// Waits until no other process has the open file @p file locked, and locks it; closed where that fails.
void NewFile::Lock(int file) {
  constexpr int kPauseMilliseconds = 5;
  for (int waited = 0; flock(file, LOCK_EX | LOCK_NB) != 0; waited += kPauseMilliseconds) {
    const int error = errno;
    if (error == EWOULDBLOCK && waited < kPatienceMilliseconds) {
      usleep(kPauseMilliseconds * 1000);
      continue;
    }
    close(file);
    if (error != EWOULDBLOCK) FailFile(path_, "locked", error);
    throw Error(Error::Kind::Failed, "The file " + path_ + " is locked by another process.");
  }
}

bool NewFile::IsTemporary(int file) const {
  struct stat own;
  struct stat named;
  return fstat(file, &own) == 0 && lstat(temporary_.c_str(), &named) == 0 && own.st_dev == named.st_dev &&
         own.st_ino == named.st_ino;
}

NewFile::NewFile(const std::string& path) : path_(path) {
  const std::size_t slash = path.rfind('/') + 1;
  temporary_ = path.substr(0, slash) + "." + path.substr(slash) + ".new";
  while (true) {
    file_ = open(temporary_.c_str(), O_RDWR | O_CREAT | O_EXCL | O_CLOEXEC, 0600);
    if (file_ < 0) {
      if (errno != EEXIST) FailFile(path_, "written", errno);
      ClearTemporary();
      continue;
    }
    fchmod(file_, 0600);
    Lock(file_);
    if (IsTemporary(file_)) return;
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
      (unreadable || IsTemporary(file)) && unlink(temporary_.c_str()) != 0 && errno != ENOENT ? errno : 0;
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
  if (folder < 0) return;  // a folder that may be written but not read: nothing more can be done
  fsync(folder);
  close(folder);
}

void NewFile::Replace() {
  Sync();
  if (rename(temporary_.c_str(), path_.c_str()) != 0) FailFile(path_, "written", errno);
  temporary_.clear();
  SyncFolder();
}

bool NewFile::Publish() {
  Sync();
  // Some file systems know only one of the two ways.
  if (renameat2(AT_FDCWD, temporary_.c_str(), AT_FDCWD, path_.c_str(), RENAME_NOREPLACE) == 0) {
    temporary_.clear();
  } else if (errno == EEXIST || (link(temporary_.c_str(), path_.c_str()) != 0 && errno == EEXIST)) {
    return false;
  } else if (access(path_.c_str(), F_OK) != 0) {
    FailFile(path_, "written", errno);
  }
  SyncFolder();
  return true;
}

}  // namespace host
