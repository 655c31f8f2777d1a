#include "ima/FirmwareImage.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <charconv>
#include <cstring>
#include <iterator>
#include <map>

#include "host/Formats.h"
#include "host/Storage.h"

namespace ima {

namespace {

constexpr std::string_view kMagic = "ISCSI-ADAPTER-IMAGE 1\n";
constexpr std::size_t kHeaderMost = 8192;

/// The beginning of a file, as far as a header can reach.
class File {
 public:
  explicit File(const std::string& path)
      : path_(path), file_(open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK)) {
    if (file_ < 0) RefuseForSystem();
  }
  File(const File&) = delete;
  File& operator=(const File&) = delete;
  ~File() {
    if (file_ >= 0) close(file_);
  }

  [[noreturn]] void Refuse(const std::string& why,
                           host::Error::Kind kind = host::Error::Kind::Invalid) const {
    throw host::Error(kind, "The image " + host::Quoted(path_) + " is refused: " + why + ".");
  }
  [[noreturn]] void RefuseForSystem() const {
    Refuse(std::strerror(errno), host::Error::KindOfSystem(errno));
  }
  std::uint64_t Size() const {
    struct stat status {};
    if (fstat(file_, &status) != 0) RefuseForSystem();
    if (!S_ISREG(status.st_mode)) Refuse("it is no file");
    return static_cast<std::uint64_t>(status.st_size);
  }
  std::string Beginning() const {
    std::string bytes(kHeaderMost, '\0');
    std::size_t length = 0;
    while (length < bytes.size()) {
      const ssize_t got = read(file_, bytes.data() + length, bytes.size() - length);
      if (got < 0 && errno == EINTR) continue;
      if (got < 0) RefuseForSystem();
      if (got == 0) break;
      length += static_cast<std::size_t>(got);
    }
    bytes.resize(length);
    return bytes;
  }

 private:
  std::string path_;
  int file_;
};

/// The number that is all of @p text, if it is one.
template <class Number>
bool IsNumber(std::string_view text, Number& number) {
  const auto [end, fault] = std::from_chars(text.data(), text.data() + text.size(), number);
  return fault == std::errc() && end == text.data() + text.size();
}

/// Where @p text stands in @p words, or the number that it is itself.
template <class Number, std::size_t count>
bool IsWordOrNumber(std::string_view text, const char* const (&words)[count], Number& number) {
  for (std::size_t i = 0; i < count; ++i) {
    if (text != words[i]) continue;
    number = static_cast<Number>(i);
    return true;
  }
  return IsNumber(text, number);
}

}  // namespace

FirmwareImage ReadFirmwareImage(const std::string& path) {
  static constexpr const char* kTypes[] = {"firmware", "option rom", "all", "bootcode"};
  static constexpr const char* kUpgrades[] = {"false", "true", "unknown"};
  static constexpr const char* kKeys[] = {"type", "version", "description", "upgrade", "model", "length"};

  const File file(path);
  const std::uint64_t size = file.Size();
  const std::string header = file.Beginning();
  if (!header.starts_with(kMagic)) file.Refuse("it does not begin with the line of an image");

  std::map<std::string, std::string> values;
  std::size_t begin = kMagic.size();
  while (!values.contains("length")) {
    const std::size_t end = header.find('\n', begin);
    if (end == header.npos) file.Refuse("its header is cut off");
    const std::string line = header.substr(begin, end - begin);
    const std::size_t colon = line.find(": ");
    const std::string key = line.substr(0, colon);
    const bool known = std::find(std::begin(kKeys), std::end(kKeys), key) != std::end(kKeys);
    if (colon == line.npos || !known) file.Refuse("its header has the line " + host::Quoted(line));
    if (!values.emplace(key, line.substr(colon + 2)).second)
      file.Refuse("its header has two lines \"" + key + "\"");
    begin = end + 1;
  }

  FirmwareImage image{
      .version = values["version"], .description = values["description"], .model = values["model"]};
  std::uint64_t length = 0;
  if (!IsWordOrNumber(values["type"], kTypes, image.type)) file.Refuse("its type is none");
  if (values.contains("upgrade") && !IsWordOrNumber(values["upgrade"], kUpgrades, image.upgrade)) {
    file.Refuse("its upgrade mark is none");
  }
  if (image.version.empty()) file.Refuse("it has no version");
  if (!host::IsUtf8(image.version) || !host::IsUtf8(image.description))
    file.Refuse("its texts are not UTF-8");
  if (!IsNumber(values["length"], length)) file.Refuse("its length is no number");
  if (size - begin != length) file.Refuse("it is not as long as its header says");
  return image;
}

}  // namespace ima
