#include "plinth/LibraryFile.h"

#include <fcntl.h>
#include <link.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdint>
#include <cstring>
#include <vector>

namespace Plinth {

namespace {

constexpr char kNoLibrary[] = "it is no shared library";
constexpr char kCutShort[] = "it is cut short";

class File {
 public:
  // Without waiting for whoever may write into a pipe.
  explicit File(const std::string& path)
      : descriptor_(open(path.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC)) {}
  File(const File&) = delete;
  File& operator=(const File&) = delete;
  ~File() {
    if (descriptor_ != -1) close(descriptor_);
  }

  bool Look(struct stat& status) const { return descriptor_ != -1 && fstat(descriptor_, &status) == 0; }
  bool Read(void* data, std::size_t size, std::uint64_t offset) const {
    return pread(descriptor_, data, size, static_cast<off_t>(offset)) == static_cast<ssize_t>(size);
  }

 private:
  int descriptor_;
};

/// True where @p count bytes from @p offset on lie within @p size; without overflow, for a header may say
/// anything.
bool Holds(std::uint64_t size, std::uint64_t offset, std::uint64_t count) {
  return offset <= size && count <= size - offset;
}

}  // namespace

std::string LibraryFault(const std::string& path) {
  const File file(path);
  struct stat status;
  if (!file.Look(status)) return std::strerror(errno);
  if (!S_ISREG(status.st_mode)) return "it is no regular file";
  ElfW(Ehdr) header;
  if (!file.Read(&header, sizeof header, 0) || std::memcmp(header.e_ident, ELFMAG, SELFMAG) != 0 ||
      header.e_type != ET_DYN || header.e_phentsize != sizeof(ElfW(Phdr))) {
    return kNoLibrary;
  }
  const auto size = static_cast<std::uint64_t>(status.st_size);
  std::vector<ElfW(Phdr)> segments(header.e_phnum);
  const std::size_t bytes = segments.size() * sizeof(ElfW(Phdr));
  if (!Holds(size, header.e_phoff, bytes) || !file.Read(segments.data(), bytes, header.e_phoff) ||
      !Holds(size, header.e_shoff, std::uint64_t{header.e_shnum} * header.e_shentsize)) {
    return kCutShort;
  }
  for (const ElfW(Phdr) & segment : segments) {
    if (segment.p_type == PT_LOAD && !Holds(size, segment.p_offset, segment.p_filesz)) return kCutShort;
  }
  return "";
}

}  // namespace Plinth
