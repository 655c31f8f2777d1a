#include <unistd.h>

#include <climits>
#include <string>
#include <vector>

#include "plinth/CommandLine.h"

namespace {

/// Relative to the program, so that an installed tree may be moved.
std::string PluginFolder() {
  char path[PATH_MAX];
  const ssize_t length = readlink("/proc/self/exe", path, sizeof path);
  std::string folder(path, length > 0 ? static_cast<std::size_t>(length) : 0);
  folder.erase(folder.find_last_of('/') + 1);
  return folder + "../lib/hcli/plugins";
}

}  // namespace

int main(int count, char** arguments) {
  return Plinth::RunProgram(std::vector<std::string>(arguments + (count > 0), arguments + count),
                            PluginFolder());
}
