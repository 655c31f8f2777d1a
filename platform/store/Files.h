/// Files of the host.
#pragma once

#include <sys/stat.h>
#include <sys/types.h>

#include <cstddef>
#include <string>
#include <string_view>

#pragma GCC visibility push(default)

namespace store {

/// Where the absolute path @p path of the host lies: under HCLI_ROOT, or as it is without one. An Error where
/// that is empty, which a script with an unset variable makes it: the host is not to be this machine by
/// mistake.
std::string HostPath(std::string_view path);

/// An Error that says what could not be done with the file @p path, and the reason that errno gives.
[[noreturn]] void FailFile(const std::string& path, const char* what, int error);

/// How long another process that writes is waited for, unless SetPatience says otherwise.
constexpr int kPatienceMilliseconds = 20000;
/// How long between two looks whether it has ended.
constexpr int kPauseMilliseconds = 5;

/// How long it is waited for now, in milliseconds.
int Patience();
/// Host::SetPatience does this for what the host has open too. Returns what held before.
int SetPatience(int milliseconds);

/// The folder that @p path lies in, or the nearest one above that exists.
std::string NearestFolder(std::string path);

/// Makes the folder that @p path lies in, and those above it.
void MakeFoldersFor(const std::string& path);

/// Whether there is something at @p path, a link that leads nowhere too. What is there has to be a regular
/// file: a link could lead a privileged process to a file that is someone else's, and a pipe would keep it
/// waiting. Where it is none, or cannot be looked at, an Error that begins with @p what and the path says so.
bool IsRegularFile(const char* what, const std::string& path, struct stat& status);

/// The contents of @p path, whatever it is, of at most @p most bytes; false where there is no such file.
bool ReadFile(const std::string& path, std::size_t most, std::string& contents);
/// The same of standard input from where it stands, whatever it is.
void ReadStandardInput(std::size_t most, std::string& contents);
/// The same for a file of the host, which has to be a regular one.
bool ReadHostFile(const std::string& path, std::string& contents);

/// Takes from all but the owner what the mode @p status of @p path gives them, where this process may.
void KeepPrivate(const std::string& path, const struct stat& status);

/// A file that comes into being beside @p path and takes its place in one step, or leaves no trace. What a
/// process leaves that was killed in between, one file at the most, the next one clears away.
class NewFile {
 public:
  /// Made with mode 0600, whatever the umask, when nobody else makes one for the same path.
  explicit NewFile(const std::string& path);
  NewFile(const NewFile&) = delete;
  NewFile& operator=(const NewFile&) = delete;
  ~NewFile();

  void Write(std::string_view bytes);
  void SetOwnerAndMode(uid_t owner, gid_t group, mode_t mode);
  /// Takes the place of @p path, durable when it returns.
  void Replace();
  /// The same where @p path does not exist; where it does, it stays as it is and the result is false. Where
  /// the file is in its place and its folder cannot be synced, an Error says so.
  bool Publish();

 private:
  void Sync();
  void SyncFolder();

  void Lock(int file);
  void ClearTemporary();

  std::string path_;
  std::string temporary_;  // empty once there is nothing to clean up
  int file_ = -1;
};

/// Removes what a killed process has left of a NewFile for @p path, where this process may and nobody is at
/// work on one. For where no NewFile follows, which would do it.
void ClearLeftover(const std::string& path);

}  // namespace store

#pragma GCC visibility pop
