#include "linux/Check.h"

#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstring>
#include <fstream>

#include "host/Formats.h"
#include "host/Host.h"
#include "host/Storage.h"
#include "linux/Attributes.h"
#include "linux/Joined.h"
#include "linux/OpenIscsi.h"
#include "linux/Program.h"
#include "linux/Records.h"

namespace linux {

namespace {

constexpr const char* kNameFile = "/etc/iscsi/initiatorname.iscsi";
constexpr std::chrono::seconds kVersionLimit{5};
/// The versions that write and read records as this program does begin here.
constexpr int kLeastVersion[] = {2, 1};

Finding There(const std::string& found) { return {{}, true, found, {}}; }
Finding Missing(const std::string& found, const std::string& mend) { return {{}, false, found, mend}; }

/// Of "iscsiadm version 2.1.8" the last word.
bool IsRecent(const std::string& version) {
  int parts[2] = {};
  if (sscanf(version.c_str(), "%d.%d", &parts[0], &parts[1]) != 2) return false;
  return !std::ranges::lexicographical_compare(parts, kLeastVersion);
}

Finding Rights() {
  if (geteuid() == 0) return There("root");
  return Missing("user " + std::to_string(geteuid()),
                 "Only root manages this machine's initiator: use sudo.");
}

Finding Package() {
  const char* mend = "Install the package open-iscsi, 2.1 or later: apt-get install open-iscsi";
  if (access(host::HostPath(kIscsiadm).c_str(), X_OK) != 0) return Missing(Joined({"no ", kIscsiadm}), mend);
  const Ended ended = RunProgram({kIscsiadm, "--version"}, kVersionLimit);
  std::string version = ended.output.substr(0, ended.output.find('\n'));
  version.erase(0, version.rfind(' ') + 1);
  if (ended.status != 0 || version.empty()) return Missing(Joined({kIscsiadm, " does not run"}), mend);
  return IsRecent(version) ? There("open-iscsi " + version) : Missing("open-iscsi " + version, mend);
}

Finding Module() {
  if (!Names("/sys/class/iscsi_transport", "tcp").empty()) return There("iscsi_tcp");
  return Missing(
      "no iscsi_tcp in the kernel",
      "Load the module: modprobe iscsi_tcp; a line iscsi_tcp in /etc/modules-load.d/iscsi.conf does it at"
      " each start.");
}

/// What iscsiadm(8) talks to is an abstract socket, which has no file.
bool HasSocket() {
  std::ifstream sockets(host::HostPath("/proc/net/unix"));
  std::string line;
  while (std::getline(sockets, line)) {
    if (line.ends_with(" @ISCSIADM_ABSTRACT_NAMESPACE")) return true;
  }
  return false;
}

Finding Socket() {
  if (HasSocket()) return There("open");
  return Missing("nobody listens for iscsiadm", "Start it: systemctl enable --now iscsid.socket");
}

Finding Daemon() {
  for (const std::string& process : Names("/proc")) {
    if (process.find_first_not_of("0123456789") == process.npos &&
        Attribute("/proc/" + process + "/comm") == "iscsid")
      return There("iscsid, process " + process);
  }
  // A service manager that holds the socket starts the daemon when somebody asks.
  if (HasSocket()) return There("starts when it is asked");
  return Missing("iscsid does not run", "Start it: systemctl enable --now iscsid");
}

Finding NameFile() {
  const std::string path = host::HostPath(kNameFile);
  const std::string mend = Joined({"Give this machine a name: echo InitiatorName=$(iscsi-iname) >", kNameFile,
                                   " && chmod 600 ", kNameFile});
  struct stat status;
  if (stat(path.c_str(), &status) != 0) return Missing(Joined({"no ", kNameFile}), mend);
  if (access(path.c_str(), R_OK) != 0)
    return Missing(Joined({kNameFile, ": ", strerror(errno)}), "Only root may: use sudo.");
  const std::string name = ValueOf(ReadRecord(kNameFile).value_or(Record()), "InitiatorName");
  if (name.empty()) return Missing(Joined({"no InitiatorName in ", kNameFile}), mend);
  const std::string fault = host::IscsiNameFault(name);
  if (!fault.empty()) return Missing(host::Excerpt(name) + ": " + fault, mend);
  return There(name);
}

struct Part {
  const char* name;
  Finding (*look)();
};

constexpr Part kParts[] = {
    {"rights", Rights}, {"package", Package}, {"module", Module},
    {"socket", Socket}, {"daemon", Daemon},   {kNamePart, NameFile},
};

}  // namespace

std::vector<Finding> CheckMachine() {
  host::Host::Current().Settle();  // programs that are asked take their time
  std::vector<Finding> findings;
  for (const Part& part : kParts) {
    Finding finding;
    try {
      finding = part.look();
    } catch (const host::Error& error) {
      finding = Missing(error.what(), "Mend what stands there, and look again.");
    }
    finding.part = part.name;
    findings.push_back(std::move(finding));
  }
  return findings;
}

}  // namespace linux
