#include "linux/Records.h"

#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdint>

#include "host/Formats.h"
#include "host/Storage.h"
#include "linux/Joined.h"

namespace linux {

namespace {

constexpr std::size_t kMostBytes = std::size_t{1} << 20U;
constexpr std::string_view kSpace = " \t\r";

std::string_view Trimmed(std::string_view text) {
  const std::size_t begin = text.find_first_not_of(kSpace);
  if (begin == text.npos) return {};
  return text.substr(begin, text.find_last_not_of(kSpace) - begin + 1);
}

/// As one name in a folder.
std::string Name(std::string_view what, std::string_view text) {
  if (text.empty() || text == "." || text == ".." || text.find('/') != text.npos ||
      !host::StorableFault(text).empty())
    throw host::Error(host::Error::Kind::Invalid, std::string(what) + " " + host::Excerpt(text) +
                                                      " cannot be the name of a file of open-iscsi.");
  return std::string(text);
}

void MakePrivateFolder(const std::string& path) {
  if (mkdir(path.c_str(), 0700) != 0 && errno != EEXIST) host::FailFile(path, "made", errno);
}

}  // namespace

Record ParseRecord(std::string_view text) {
  Record record;
  while (!text.empty()) {
    const std::size_t end = std::min(text.find('\n'), text.size());
    const std::string_view line = Trimmed(text.substr(0, end));
    text.remove_prefix(std::min(end + 1, text.size()));
    const std::size_t equals = line.find('=');
    if (line.starts_with('#') || equals == line.npos) continue;
    record.emplace_back(Trimmed(line.substr(0, equals)), Trimmed(line.substr(equals + 1)));
  }
  return record;
}

std::string RecordText(const Record& record) {
  std::string text;
  for (const auto& [name, value] : record) {
    // Not the value itself: it may be a secret.
    if (value.empty() || Trimmed(value) != value ||
        value.find_first_of(std::string_view("\n\0", 2)) != value.npos)
      throw host::Error(host::Error::Kind::Invalid,
                        "The value of " + name +
                            " cannot stand in a record of open-iscsi: it is empty, begins or ends"
                            " with a space, or has more than one line.");
    text.append(name).append(" = ").append(value).append("\n");
  }
  return text;
}

std::string ValueOf(const Record& record, std::string_view name) {
  std::string value;
  for (const auto& line : record) {
    if (line.first == name) value = line.second;
  }
  return value;
}

std::optional<Record> ReadRecord(std::string_view path) {
  std::string text;
  if (!host::ReadFile(host::HostPath(path), kMostBytes, text)) return {};
  return ParseRecord(text);
}

void WriteRecord(std::string_view path, const Record& record) {
  const std::string text = RecordText(record);
  const std::string file = host::HostPath(path);
  const std::string top = host::HostPath("/etc/iscsi/");
  host::MakeFoldersFor(top + "x");
  for (std::size_t slash = top.size(); (slash = file.find('/', slash)) != file.npos; ++slash)
    MakePrivateFolder(file.substr(0, slash));
  host::NewFile made(file);
  made.Write(text);
  made.Replace();
}

void RemoveRecord(std::string_view path, std::string_view top) {
  std::string file = host::HostPath(path);
  if (unlink(file.c_str()) != 0 && errno != ENOENT) host::FailFile(file, "removed", errno);
  const std::size_t least = host::HostPath(top).size();
  for (;;) {
    file.resize(file.rfind('/'));
    if (file.size() <= least || rmdir(file.c_str()) != 0) return;
  }
}

std::string InterfacePath(std::string_view interface) {
  return Joined({kInterfaces, "/", Name("The interface", interface)});
}

std::string NodePath(std::string_view target, std::string_view address, std::int64_t port, int group,
                     std::string_view interface) {
  return Joined({kNodes, "/", Name("The target", target), "/", Name("The address", address), ",",
                 std::to_string(port), ",", std::to_string(group), "/", Name("The interface", interface)});
}

std::string SendTargetsPath(std::string_view address, std::int64_t port) {
  return Joined({kSendTargets, "/", Name("The address", address), ",", std::to_string(port), "/st_config"});
}

}  // namespace linux
