#include "linux/Attributes.h"

#include <algorithm>
#include <charconv>
#include <filesystem>
#include <fstream>

#include "host/Storage.h"

namespace linux {

namespace {

constexpr std::size_t kMostBytes = 4096;  // one page is all that sysfs tells of an attribute

}  // namespace

std::string Attribute(const std::string& path) {
  // Attributes come and go with their objects, at any time: what cannot be read is not there.
  std::ifstream file(host::HostPath(path));
  std::string text(kMostBytes, '\0');
  file.read(text.data(), static_cast<std::streamsize>(text.size()));
  text.resize(static_cast<std::size_t>(file.gcount()));
  text.resize(std::min(text.find('\n'), text.size()));
  return text == "(null)" ? "" : text;
}

std::int64_t NumberAttribute(const std::string& path) {
  const std::string text = Attribute(path);
  std::int64_t number = 0;
  std::from_chars(text.data(), text.data() + text.size(), number);
  return number;
}

std::vector<std::string> Names(const std::string& folder, std::string_view prefix) {
  std::vector<std::string> names;
  std::error_code error;
  std::filesystem::directory_iterator entry(host::HostPath(folder), error);
  for (; !error && entry != std::filesystem::directory_iterator(); entry.increment(error)) {
    std::string name = entry->path().filename().string();
    if (name.starts_with(prefix)) names.push_back(std::move(name));
  }
  std::sort(names.begin(), names.end());
  return names;
}

std::string LinkAt(const std::string& path) {
  std::error_code error;
  return std::filesystem::read_symlink(host::HostPath(path), error).string();
}

}  // namespace linux
