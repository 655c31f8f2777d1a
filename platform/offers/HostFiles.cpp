#include "offers/HostFiles.h"

#include <fcntl.h>
#include <pwd.h>
#include <sys/stat.h>
#include <sys/statvfs.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <fstream>
#include <sstream>

#include "host/Storage.h"

namespace offers {

namespace {

using Plinth::FindingState;

constexpr const char* kFolder = "host folder";
constexpr const char* kDatabase = "host database";
constexpr const char* kJournal = "host database's journal";

bool May(const std::string& path, int what) {
  return faccessat(AT_FDCWD, path.c_str(), what, AT_EACCESS) == 0;
}

std::string UserName(uid_t user) {
  passwd entry{};
  passwd* found = nullptr;
  char space[4096];
  const bool isKnown = getpwuid_r(user, &entry, space, sizeof space, &found) == 0 && found != nullptr;
  return isKnown ? entry.pw_name : "user " + std::to_string(user);
}

std::string OctalText(mode_t mode) {
  char text[16];
  std::snprintf(text, sizeof text, "%04o", static_cast<unsigned>(mode & 07777U));
  return text;
}

void CheckSpace(const std::string& folder, Findings& findings) {
  constexpr unsigned long long kLittle = 1 << 20;
  struct statvfs space;
  if (statvfs(folder.c_str(), &space) != 0) return;
  const unsigned long long bytes = static_cast<unsigned long long>(space.f_bavail) * space.f_frsize;
  const bool hasNoFiles = space.f_files > 0 && space.f_favail == 0;
  const std::string text = std::to_string(bytes / 1024) + " KiB are free in " + folder +
                           (hasNoFiles ? ", and no more files can be made there." : ".");
  FindingState state = bytes < kLittle || hasNoFiles ? FindingState::Warning : FindingState::Ok;
  if (bytes == 0) state = FindingState::Fault;
  findings.push_back({"free space", state, text, state == FindingState::Ok ? "" : "df -h " + folder});
}

/// The process that keeps the file locked for writing; 0 where none does, or where it cannot be told. Looked
/// up rather than asked for by fcntl: to close the file again would end the locks of this process.
pid_t WriterOf(const struct stat& status) {
  // The bytes that SQLite locks, https://www.sqlite.org/fileformat2.html#the_lock_byte_page.
  constexpr unsigned long long kFirst = 0x40000000;
  constexpr unsigned long long kLast = kFirst + 511;
  std::ifstream locks("/proc/locks");
  for (std::string line; std::getline(locks, line);) {
    std::istringstream words(line);
    std::string number;
    std::string kind;
    std::string advisory;
    std::string access;
    std::string place;
    pid_t pid = 0;
    unsigned long long first = 0;
    words >> number >> kind >> advisory >> access >> pid >> place >> first;
    const std::string file = place.substr(place.rfind(':') + 1);
    if (words && kind == "POSIX" && access == "WRITE" && file == std::to_string(status.st_ino) &&
        first >= kFirst && first <= kLast && pid != getpid()) {
      return pid;
    }
  }
  return 0;
}

/// A writer that is about to end is none.
pid_t LastingWriterOf(const struct stat& status) {
  pid_t writer = WriterOf(status);
  for (int waited = 0; writer != 0 && waited < std::min(host::Patience(), 1000); waited += 50) {
    usleep(50 * 1000);
    writer = WriterOf(status);
  }
  return writer;
}

std::string ProcessText(pid_t process) {
  std::ifstream file("/proc/" + std::to_string(process) + "/comm");
  std::string name;
  std::getline(file, name);
  return "process " + std::to_string(process) + (name.empty() ? "" : " (" + host::Printable(name) + ")");
}

void CheckAccess(const std::string& path, const struct stat& status, Findings& findings) {
  const mode_t mode = status.st_mode & 07777U;
  Plinth::Finding access{"access to the host database", FindingState::Ok,
                         "It belongs to " + UserName(status.st_uid) + ", mode " + OctalText(mode) + ".", ""};
  if (status.st_uid != geteuid()) {
    access.state = FindingState::Warning;
    access.mend = "sudo chown " + UserName(geteuid()) + " " + path + ", or run hcli as its owner";
  } else if ((mode & ~0600U) != 0) {
    access.state = FindingState::Warning;
    access.seen += " Others than its owner may have read its secrets.";
    access.mend = "chmod 600 " + path;
  } else if (!May(path, W_OK)) {
    access.state = FindingState::Warning;
    access.seen += std::string(" It can be looked at, and not changed: ") + std::strerror(errno) + ".";
    access.mend = errno == EROFS ? "Mount the file system for writing." : "chmod 600 " + path;
  }
  findings.push_back(access);
}

/// False where a change was cut off, which has to be undone before anybody can read.
bool CheckJournal(const std::string& path, pid_t writer, Findings& findings) {
  struct stat status;
  if (writer != 0 || stat((path + "-journal").c_str(), &status) != 0 || status.st_size == 0) return true;
  findings.push_back({kJournal, FindingState::Warning,
                      "A change was cut off, and is still to be undone: " + path + "-journal is there.",
                      "Run any command on the host: the first one undoes it."});
  return false;
}

/// False where there is none.
bool IsThere(const std::string& path, Findings& findings) {
  struct stat status;
  if (host::IsRegularFile("The host database", path, status)) return true;
  host::RequireNoJournalAlone(path);
  findings.push_back(
      {kDatabase, FindingState::Ok, path + " is not there yet: the first command makes the host.", ""});
  return false;
}

}  // namespace

void CheckFolder(const std::string& path, Findings& findings) {
  const std::string folder = host::NearestFolder(path);
  if (May(folder, W_OK | X_OK)) {
    findings.push_back({kFolder, FindingState::Ok, folder + " can be written to.", ""});
  } else {
    const int error = errno;
    findings.push_back(
        {kFolder, May(path, F_OK) ? FindingState::Warning : FindingState::Fault,
         folder + " cannot be written to, so that nothing can be changed: " + std::strerror(error) + ".",
         error == EROFS ? "Mount the file system for writing."
                        : "Run hcli as a user who may: sudo hcli ..."});
  }
  CheckSpace(folder, findings);
}

bool CheckFile(const std::string& path, Findings& findings) try {
  if (!IsThere(path, findings)) return false;
  struct stat status;
  if (stat(path.c_str(), &status) != 0) return false;  // gone since
  CheckAccess(path, status, findings);
  if (!May(path, R_OK)) {
    findings.push_back({kDatabase, FindingState::Fault,
                        path + " cannot be read: " + std::strerror(errno) + ".",
                        "Run hcli as a user who may: sudo hcli ..."});
    return false;
  }
  const pid_t writer = LastingWriterOf(status);
  if (writer == 0) {
    findings.push_back({"host lock", FindingState::Ok, "Nobody keeps the database locked.", ""});
  } else {
    findings.push_back(
        {"host lock", FindingState::Warning,
         "The " + ProcessText(writer) + " keeps the database locked, and others from changing it.",
         "Wait for that process, or end it: kill " + std::to_string(writer)});
  }
  return CheckJournal(path, writer, findings);
} catch (const host::Error& error) {
  findings.push_back({kDatabase, FindingState::Fault, error.what(), "ls -l " + host::NearestFolder(path)});
  return false;
}

}  // namespace offers
