/// What is read from, and written for, this machine's own initiator, on files that were kept of a real one.

#include <sys/stat.h>

#include <filesystem>
#include <fstream>
#include <sstream>

#include "host/LevelSchema.h"
#include "host/Storage.h"
#include "linux/Check.h"
#include "linux/Interfaces.h"
#include "linux/Parameters.h"
#include "linux/Records.h"
#include "linux/Sessions.h"
#include "support/Harness.h"
#include "support/ProjectFile.h"

namespace {

using testing::AllOf;
using testing::ElementsAre;
using testing::Field;
using testing::ThrowsMessage;

void Write(const TemporaryRoot& root, const std::string& path, const std::string& text) {
  const std::filesystem::path file = root.Path() + path;
  std::filesystem::create_directories(file.parent_path());
  std::ofstream(file) << text << '\n';
}

/// Lines "PATH=TEXT" are files of a kernel, lines "PATH -> PLACE" its links. What they lead to is in their
/// folders.
void WriteKernelFiles(const TemporaryRoot& root) {
  std::istringstream lines(FileText("tests/golden/kernel-files.txt"));
  std::vector<std::array<std::string, 2>> links;
  for (std::string line; std::getline(lines, line);) {
    const std::size_t arrow = line.find(" -> ");
    if (arrow != line.npos) links.push_back({line.substr(0, arrow), line.substr(arrow + 4)});
    if (arrow == line.npos) Write(root, line.substr(0, line.find('=')), line.substr(line.find('=') + 1));
  }
  for (const auto& [path, place] : links) {
    const std::filesystem::path device = std::filesystem::path(root.Path() + path).parent_path() / place;
    std::filesystem::create_directories(device.parent_path());
    std::filesystem::rename(root.Path() + path, device);
    std::filesystem::create_symlink(place, root.Path() + path);
  }
}

TEST(Linux, SessionsAreTheKernels) {
  const TemporaryRoot root;
  EXPECT_TRUE(linux::ReadSessions().empty());
  WriteKernelFiles(root);
  Write(root, "/sys/class/iscsi_session/session10/state", "FREE");  // one that is just going
  Write(root, "/sys/class/iscsi_connection/connection2:0/address", "fe80:0000:0000:0000:0000:0000:0000:0010");
  const std::vector<linux::Session> sessions = linux::ReadSessions();
  ASSERT_EQ(sessions.size(), 2u);
  const linux::Session& ours = sessions[0];
  EXPECT_EQ(std::tie(ours.number, ours.target, ours.initiator, ours.interface, ours.localAddress, ours.state,
                     ours.user),
            std::make_tuple(1, "iqn.2026-11.org.example:tgt", "iqn.2026-11.org.example:hba0", "hcli.hba0",
                            "127.0.0.1", "LOGGED_IN", "u"));
  const auto agreed = [](const linux::Session& session) {
    return std::make_tuple(session.immediateData, session.initialR2T, session.firstBurst, session.maxBurst,
                           session.maxOutstandingR2T, session.dataPduInOrder, session.recoveryTimeout);
  };
  EXPECT_EQ(agreed(ours), std::make_tuple(true, true, 65536, 262144, 1, true, 120));
  EXPECT_EQ(agreed(sessions[1]), std::make_tuple(true, true, 65536, 262144, 1, false, 45));
  EXPECT_EQ(sessions[1].user, "");  // the kernel says (null)
  using linux::Connection;
  EXPECT_THAT(
      ours.connections,
      ElementsAre(AllOf(Field(&Connection::state, "up"), Field(&Connection::address, "127.0.0.1"),
                        Field(&Connection::port, 3260), Field(&Connection::localPort, 50096),
                        Field(&Connection::headerDigest, false), Field(&Connection::maxTransmit, 8192))));
  EXPECT_THAT(
      sessions[1].connections,
      ElementsAre(AllOf(Field(&Connection::address, "fe80::10"), Field(&Connection::headerDigest, true),
                        Field(&Connection::dataDigest, false), Field(&Connection::persistentPort, 3261),
                        Field(&Connection::maxReceive, 262144))));
}

TEST(Linux, InterfacesAreTheKernels) {
  const TemporaryRoot root;
  WriteKernelFiles(root);
  Write(root, "/sys/class/net/bonding_masters", "");
  using linux::NetworkInterface;
  EXPECT_THAT(linux::ReadInterfaces(),
              ElementsAre(AllOf(Field(&NetworkInterface::name, "eth1"), Field(&NetworkInterface::mtu, 1500),
                                Field(&NetworkInterface::mac, "de:79:b6:99:90:dd"),
                                Field(&NetworkInterface::isUp, true), Field(&NetworkInterface::hasLink, true),
                                Field(&NetworkInterface::isLoopback, false))));
}

TEST(Linux, RecordsAreReadAsTheyAreWritten) {
  using linux::Record;
  EXPECT_EQ(linux::ParseRecord(
                "# BEGIN RECORD 2.1.8\nnode.name = iqn.a:b \n\nnode.session.auth.password = a=b # c\n"
                "no value\n# END RECORD"),
            (Record{{"node.name", "iqn.a:b"}, {"node.session.auth.password", "a=b # c"}}));
  const TemporaryRoot root;
  const std::string path = linux::NodePath("iqn.a:b", "fe80::1", 3260, 1, "hcli.hba0");
  EXPECT_EQ(path, "/etc/iscsi/nodes/iqn.a:b/fe80::1,3260,1/hcli.hba0");
  EXPECT_EQ(linux::ReadRecord(path), std::nullopt);
  const Record record = {{"node.name", "iqn.a:b"}, {"node.session.auth.password", "a secret"}};
  linux::WriteRecord(path, {{"node.name", "another"}});
  linux::WriteRecord(path, record);
  EXPECT_EQ(linux::ReadRecord(path), record);
  struct stat status;
  for (const auto& [place, mode] : {std::pair(path, 0100600), {"/etc/iscsi/nodes", 040700}}) {
    ASSERT_EQ(stat((root.Path() + place).c_str(), &status), 0);
    EXPECT_EQ(status.st_mode, static_cast<mode_t>(mode)) << place;
  }
  linux::RemoveRecord(path, linux::kNodes);
  linux::RemoveRecord(path, linux::kNodes);
  EXPECT_TRUE(std::filesystem::is_empty(root.Path() + "/etc/iscsi/nodes"));
}

TEST(Linux, EachParameterHasItsPlaceInARecord) {
  std::vector<std::string_view> ours;
  std::vector<std::string_view> there;
  for (const host::ParameterSpec& spec : host::kParameters) ours.push_back(spec.name);
  ours.insert(ours.end(), std::begin(host::kDigests), std::end(host::kDigests));
  for (const linux::ParameterName& name : linux::kParameterNames) there.push_back(name.parameter);
  EXPECT_THAT(there, testing::UnorderedElementsAreArray(ours));
  const linux::ParameterValue values[] = {
      {"ErrorRecoveryLevel", 2}, {"DelayedAck", 1},   {"InitialR2T", 0}, {"MaxCmds", 64},
      {"ImmediateData", 1},      {"HeaderDigest", 1}, {"DataDigest", 3}};
  EXPECT_EQ(linux::ParameterLines(values), (linux::Record{{"node.session.iscsi.InitialR2T", "No"},
                                                          {"node.session.cmds_max", "64"},
                                                          {"node.session.iscsi.ImmediateData", "Yes"},
                                                          {"node.conn[0].iscsi.HeaderDigest", "None,CRC32C"},
                                                          {"node.conn[0].iscsi.DataDigest", "CRC32C"}}));
}

TEST(Linux, NothingBreaksOutOfARecord) {
  for (const char* value : {"a\nnode.startup = automatic", "", " a", "a\t"}) {
    EXPECT_THAT(
        [&] {
          return linux::RecordText({{"node.session.auth.password", value}});
        },
        ThrowsMessage<host::Error>(
            testing::StartsWith("The value of node.session.auth.password cannot stand")));
  }
  for (const char* target : {"", "..", "a/../../b", "\xff"})
    EXPECT_THROW(linux::NodePath(target, "10.0.0.1", 3260, 1, "hcli.hba0"), host::Error) << target;
}

TEST(Linux, CheckTellsWhatIsMissing) {
  const TemporaryRoot root;
  const auto found = [](const std::string& part) {
    for (const linux::Finding& finding : linux::CheckMachine()) {
      EXPECT_EQ(finding.mend.empty(), finding.isThere) << finding.part;
      if (finding.part == part) return (finding.isThere ? "ok: " : "missing: ") + finding.found;
    }
    return part + " is not looked at";
  };
  const std::string iscsiadm = "#!/bin/sh\necho iscsiadm version ";
  const std::tuple<const char*, const char*, std::string, const char*> cases[] = {
      {"package", "", "", "missing: no /sbin/iscsiadm"},
      {"package", "/sbin/iscsiadm", iscsiadm + "2.0-873", "missing: open-iscsi 2.0-873"},
      {"package", "/sbin/iscsiadm", "#!/bin/sh\nexit 1", "missing: /sbin/iscsiadm does not run"},
      {"package", "/sbin/iscsiadm", iscsiadm + "2.1.8", "ok: open-iscsi 2.1.8"},
      {"module", "", "", "missing: no iscsi_tcp in the kernel"},
      {"module", "/sys/class/iscsi_transport/tcp/caps", "0x39", "ok: iscsi_tcp"},
      {"daemon", "/proc/88/comm", "iscsi_conn_clea", "missing: iscsid does not run"},
      {"socket", "/proc/net/unix", "0: 2 0 10000 1 1 9 @ISCSIADM_ABSTRACT_NAMESPACE", "ok: open"},
      {"daemon", "", "", "ok: starts when it is asked"},
      {"daemon", "/proc/94/comm", "iscsid", "ok: iscsid, process 94"},
      {"initiator name", "", "", "missing: no /etc/iscsi/initiatorname.iscsi"},
      {"initiator name", "/etc/iscsi/initiatorname.iscsi", "GenerateName=yes",
       "missing: no InitiatorName in /etc/iscsi/initiatorname.iscsi"},
      {"initiator name", "/etc/iscsi/initiatorname.iscsi", "InitiatorName=iqn.2026-11.org.example:a",
       "ok: iqn.2026-11.org.example:a"},
  };
  for (const auto& [part, path, text, expected] : cases) {
    if (*path != '\0') Write(root, path, text);
    chmod((root.Path() + "/sbin/iscsiadm").c_str(), 0700);
    EXPECT_EQ(found(part), expected);
  }
}

}  // namespace
