// The host descriptions that come with the program do what they are there for.
#include <fstream>
#include <iterator>

#include "support/Harness.h"
#include "support/ProjectFile.h"

namespace {

using testing::HasSubstr;

std::string HostFile(const std::string& name) {
  const std::string path = ProjectFile("hosts/" + name);
  std::ifstream file(path);
  EXPECT_TRUE(file) << path;
  return {std::istreambuf_iterator<char>(file), {}};
}

TEST(Hosts, FaultsShowEachWayInWhichAnOperationAnswers) {
  constexpr char kReboot[] = "Reboot required to complete operation.";
  constexpr char kLacks[] = "Operation not supported for this adapter.";
  const struct {
    const char* line;
    int status;
    std::string message;
    const char* trace;  // the line of the library's answer, or a part of it
  } cases[] = {
      {"adapter set -A reboots -a x", 3, kReboot, "SetInitiatorAlias(reboots, \"x\") = 1"},
      {"adapter set -A resets -a x", 0, "", "ResetAdapter(resets) = ok"},
      {"adapter set -A lacks -a x", 3, kLacks, "SetInitiatorAlias(lacks, \"x\") = 4"},
      {"physicalnetworkportal param set -A lacks -o MTU -v 1500", 3, kLacks, "SetMtu(lacks, 1500) = 4"},
      {"adapter set -A fails -a x", 1, "Unable to set name or alias.", "The adapter does not answer."},
      {"adapter capabilities get -A fails", 1, "Unable to get adapter properties.",
       "GetCapabilities(fails) !"},
      {"adapter discovery rediscover -A fails", 1, "Unable to discover targets.", "Rediscover(fails) !"},
      {"adapter target portal list", 1, "Unable to get address keys.", "= 0x80000003"},
      {"networkportal ipconfig get -A lacks", 0, "", "IMA_TSR_GetLnpOidList"},
      {"networkportal list -A lacks", 0, "", "IMA_TSR_GetNicProperties"},
  };
  for (const auto& [line, status, message, trace] : cases) {
    SCOPED_TRACE(line);
    Harness host(HostFile("faults.json"));
    const Outcome run = host(std::string("iscsi ") + line);
    EXPECT_EQ(run.status, status);
    EXPECT_EQ(run.messages, std::vector<std::string>(message.empty() ? 0 : 1, message));
    EXPECT_THAT(run.trace, testing::Contains(HasSubstr(trace)));
  }
}

TEST(Hosts, EmptyHasNothingToList) {
  Harness host(HostFile("empty.json"));
  for (const char* line : {"adapter list", "session list", "networkportal list", "plugin list"}) {
    EXPECT_EQ(host(std::string("iscsi ") + line).result, nlohmann::json::array()) << line;
  }
}

}  // namespace
