#include <stdlib.h>
#include <sys/auxv.h>
#include <unistd.h>

#include <climits>
#include <string>
#include <vector>

#include "plinth/CommandLine.h"

namespace {

/// Where the program lies, or "" where nothing tells.
std::string ProgramPath() {
  char path[PATH_MAX];
  const ssize_t length = readlink("/proc/self/exe", path, sizeof path);
  if (length > 0) return std::string(path, static_cast<std::size_t>(length));
  // Without /proc: by the name that the kernel was given.
  const auto* name = reinterpret_cast<const char*>(getauxval(AT_EXECFN));
  return name && realpath(name, path) ? path : "";
}

/// Relative to the program, so that an installed tree may be moved; "" where it cannot be found.
std::string PluginFolder() {
  std::string path = ProgramPath();
  if (path.empty()) return "";
  path.erase(path.find_last_of('/') + 1);
  return path + "../lib/hcli/plugins";
}

}  // namespace

int main(int count, char** arguments) {
  return Plinth::RunProgram(std::vector<std::string>(arguments + (count > 0), arguments + count),
                            PluginFolder());
}
