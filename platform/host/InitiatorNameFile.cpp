#include "host/InitiatorNameFile.h"

#include "host/EnvironmentText.h"
#include "host/Storage.h"

namespace host {

std::string InitiatorNameFile() { return HostPath("/etc/tessaro/coreiscsid/initiatorname.iscsi"); }

std::optional<std::string> ConfiguredInitiatorName() {
  std::string contents;
  if (!ReadHostFile(InitiatorNameFile(), contents)) return {};
  EnvironmentText file;
  file.Parse(contents);
  return file.Get("InitiatorName");
}

}  // namespace host
