#include "doctor/Bundle.h"

#include <Plinth/Rehearsal.h>
#include <fcntl.h>
#include <stdio.h>
#include <stdlib.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <string_view>

namespace TessaroCli::Doctor {

namespace {

std::string Failure(const std::string& path, int error) {
  return "The file " + path + " cannot be written: " + std::strerror(error) + '.';
}

/// 0, or the errno of what failed.
int WriteAll(int file, std::string_view text) {
  while (!text.empty()) {
    const ssize_t written = write(file, text.data(), text.size());
    if (written < 0 && errno != EINTR) return errno;
    if (written > 0) text.remove_prefix(static_cast<std::size_t>(written));
  }
  return fsync(file) == 0 ? 0 : errno;
}

/// Gives the file @p temporary the name @p path where nothing has it. 0, or the errno of what failed.
int Publish(const std::string& temporary, const std::string& path) {
  if (renameat2(AT_FDCWD, temporary.c_str(), AT_FDCWD, path.c_str(), RENAME_NOREPLACE) == 0) return 0;
  // Some file systems know only the other way.
  if (errno != EINVAL && errno != ENOSYS) return errno;
  if (link(temporary.c_str(), path.c_str()) != 0) return errno;
  unlink(temporary.c_str());
  return 0;
}

bool IsThere(const std::string& path) {
  return faccessat(AT_FDCWD, path.c_str(), F_OK, AT_SYMLINK_NOFOLLOW) == 0;
}

}  // namespace

const char* WordOf(Plinth::FindingState state) {
  switch (state) {
    case Plinth::FindingState::Ok:
      return "ok";
    case Plinth::FindingState::Warning:
      return "warning";
    case Plinth::FindingState::Fault:
      break;
  }
  return "fault";
}

std::string BundleText(const std::vector<Plinth::Finding>& findings,
                       const std::vector<Plinth::Enclosure>& enclosures) {
  std::string text =
      "A report of hcli doctor. It has names and addresses of this host, and no secrets.\nIn it: findings";
  for (const Plinth::Enclosure& enclosure : enclosures) text += ", " + enclosure.name;
  text += ".\n\n== findings ==\n\n";
  for (const Plinth::Finding& finding : findings) {
    text.append(WordOf(finding.state)).append(": " + finding.check + ": " + finding.seen + '\n');
    if (!finding.mend.empty()) text += "   Mend: " + finding.mend + '\n';
  }
  for (const Plinth::Enclosure& enclosure : enclosures) {
    text += "\n== " + enclosure.name + " ==\n\n" + enclosure.text;
    if (text.back() != '\n') text += '\n';
  }
  return text;
}

std::string WriteBundle(const std::string& path, const std::string& text) {
  if (path.empty()) return "The name of the report's file is empty.";
  if (IsThere(path)) return "The file " + path + " is there already, and stays as it is: give another name.";
  if (Plinth::IsRehearsing()) return "";
  const std::size_t name = path.rfind('/') + 1;
  std::string temporary = path.substr(0, name) + '.' + path.substr(name) + ".XXXXXX";
  const int file = mkostemp(temporary.data(), O_CLOEXEC);  // of mode 0600
  if (file < 0) return Failure(path, errno);
  int error = WriteAll(file, text);
  if (close(file) != 0 && error == 0) error = errno;
  if (error == 0) error = Publish(temporary, path);
  if (error == 0) return "";
  unlink(temporary.c_str());
  return Failure(path, error);
}

}  // namespace TessaroCli::Doctor
