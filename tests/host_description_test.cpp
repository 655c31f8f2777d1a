// Descriptions: what is read, what is refused and where, what is shown.
#include <fcntl.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>

#include "host/Host.h"
#include "host/Schema.h"
#include "host/Storage.h"
#include "simulator/Commands.h"
#include "simulator/Description.h"
#include "simulator/Simulator.h"
#include "support/Harness.h"
#include "support/ProjectFile.h"

using nlohmann::json;
using testing::AllOf;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::Not;
using testing::StartsWith;
using testing::ThrowsMessage;

namespace {

struct Refusal {
  std::string keys, fault;
};

/// Loads each row's keys between @p before and @p after; it is refused for its fault at @p path, and the host
/// stays.
void ExpectRefused(const std::string& before, const std::string& after, const std::string& path,
                   const std::vector<Refusal>& rows) {
  for (const auto& [keys, fault] : rows) {
    SCOPED_TRACE(keys);
    const Harness host(R"({"adapters": [{"name": "before"}]})");
    const json shown = host.Show();
    const std::string description = before + keys + after;
    EXPECT_THAT([&] { simulator::Load(description); }, ThrowsMessage<host::Error>(StartsWith(path + fault)));
    EXPECT_EQ(host.Show(), shown);
  }
}

TEST(HostDescription, FaultsNameTheirPath) {
  const std::vector<Refusal> documents = {
      {"", "not a JSON document: parse error at line 1, column 1"},
      {"{\n\"adapters\": [,]}", "not a JSON document: parse error at line 2"},
      {R"({"adapters": [{"state": 1e999)", "adapters[0].state: the number is too large (line 1, column 25)"},
      {"[]", "expected an object in braces"},
      {R"({"adapters": {}})", "adapters: expected a list"},
      {R"({"adapter": []})", "unknown key \"adapter\"; did you mean \"adapters\"? (line 1, column 2)"},
      {"{\n \"zzzzzzz\\nzzzz\": []}", "unknown key \"zzzzzzz\\nzzzz\" (line 2, column 2)"},
      {"{\"" + std::string(70000, 'x') + "\": 0}",
       "unknown key \"" + std::string(64, 'x') + "\"... (70000 bytes) (line 1, column 2)"},
      {R"({"bootTables": [{"chapPwd": "", "hush": ""}]})",
       "bootTables[0]: unknown key, not shown because it may be a secret (line 1, column 33)"},
      {R"({"adapters": [{"name": "x", "chap": {"hush": {}}}]})", "adapters[0].chap: unknown key, not shown"},
      {R"({"nics": [1]})", "nics[0]: expected an object in braces (line 1, column 11)"},
      {R"({"nics": 12})", "nics: expected a list (line 1, column 10)"},
      {"{\"nics\": [\n {}]}", "nics[0].name: missing, and required (line 2, column 2)"},
      {R"({"adapters": [{}]})", "adapters[0].name: missing, and required"},
      {R"({"adapters": [{"name": ""}]})", "adapters[0].name: must not be empty"},
      {R"({"adapters": [{"name": 3}]})", "adapters[0].name: expected a text"},
      {R"({"adapters": [{"name": "a\u0000b"}]})", "adapters[0].name: a text cannot hold a zero character"},
      {R"({"adapters": [{"name": "x"}, {"name": "y"}, {"name": "x"}]})",
       "adapters[2].name: \"x\" is taken by adapters[0]"},
      {R"({"adapters": [{"name": "x"}, {"name": "x", "name": "y"}]})", "adapters[1].name: is given twice"},
      {R"({"nics": [{"name": "n", "ipv6Addresses": [{"address": "::2"}, {"address": "::2"}]}]})",
       "nics[0].ipv6Addresses[1].address: \"::2\" is taken by ipv6Addresses[0]"},
      {R"({"bootTables": [{"lun": "9223372036854775808"}]})",
       "bootTables[0].lun: expected a whole number from 0 to 9223372036854775807"},
      {R"({"remoteTargets": [{"name": "t", "chap": {"secret": "***"}}]})",
       "remoteTargets[0].chap.secret: \"***\" stands for a secret that was not shown; simulator show "
       "--secrets"},
  };
  ExpectRefused("", "", "", documents);
  const std::vector<Refusal> answers = {
      {R"("operation": "GetNames", "throw": "bad_alloc")",
       ".operation: no operation is called \"GetNames\"; did you mean \"GetName\"?"},
      {R"("operation": "GetName")", ": expected exactly one of"},
      {R"("operation": "SetMtu", "status": 1, "throw": "bad_alloc")", ": expected exactly one of"},
      {R"("operation": "GetName", "status": 1)", ".status: GetName gives no status"},
      {R"("operation": "GetName", "imaStatus": 1)", ".imaStatus: GetName is no IMA call"},
      {R"("operation": "IMA_GetLhbaOidList", "throw": "bad_alloc")",
       ": IMA_GetLhbaOidList can be answered by an \"imaStatus\" only"},
      {R"("operation": "SetMtu", "status": 1, "text": "x")", ".text: goes with \"throw\" only"},
  };
  ExpectRefused(R"({"answers": [{)", "}]}", "answers[0]", answers);
  const std::vector<Refusal> adapters = {
      {R"("capabilities": {"MTU Settable": "yes"})", ".capabilities.MTU Settable: expected true or false"},
      {R"("kind": "soft")", ".kind: expected one of \"independent\", \"dependent\", \"software\", \"scsi\""},
      {R"("state": 2147483648)", ".state: expected a whole number from -2147483648 to 2147483647"},
      {R"("state": 18446744073709551615)", ".state: expected a whole number"},
      {R"("state": 99999999999999999999999)", ".state: expected a whole number"},
      {R"("initiatorName": "host1")", ".initiatorName: it must begin with"},
      {R"("pending": {"reboot": {"network": {"mtu": true}}})",
       ".pending.reboot.network.mtu: expected a whole number"},
      {R"("pending": {"reset": {"name": "a1"}})", ".pending.reset: unknown key \"name\""},
      {R"("pending": {"reset": {"alias": null}})", ".pending.reset.alias: expected a text"},
      {R"("pending": {"reset": {"parameters": {"MaxCmds": {"current": 1}}}})",
       ".pending: parameters.MaxCmds.current: 1 is not from min"},
      {R"("parameters": {"MaxCmds": {"current": 1}})",
       ".parameters.MaxCmds.current: 1 is not from min, 2, to max, 2048"},
      {R"("parameters": {"MaxCmds": {"max": 200}}, "sendTargets": [{"host": "a", "parameters": {"MaxCmds": 201}}])",
       ".sendTargets[0].parameters.MaxCmds: 201 is not from min, 2, to max, 200"},
      {R"("staticTargets": [{"name": "t", "host": "a", "pending": {"reset": {"parameters": {"MaxCmds": 1}}}}])",
       ".staticTargets[0].pending: parameters.MaxCmds: 1 is not from min"},
      {R"("sendTargets": [{"host": "Storage"}, {"host": "storage", "port": 860}, {"host": "sTORAGE"}])",
       ".sendTargets[2].host: \"storage 3260\" is taken by adapters[1].sendTargets[0]"},
      {R"("isnsServers": [{"address": "2001:DB8::1"}])",
       ".isnsServers[0].address: expected \"2001:db8::1\", the same address in its canonical form"},
      {R"("kind": "dependent", "networkPortals": [{"nic": "ghost"}])",
       ".networkPortals[0].nic: the host has no NIC \"ghost\""},
      {R"("networkPortals": [{"nic": "n"}])", ".networkPortals[0]: only a software or dependent adapter"},
      {R"("kind": "dependent", "logicalPortals": [{"name": "p"}])",
       ".logicalPortals[0]: only an independent adapter"},
      {R"("network": {"ipv6Addresses": [{"address": "::2"}, {"address": "0::2", "prefixLength": 9}]})",
       ".network.ipv6Addresses[1].address: \"0::2\" is taken by network.ipv6Addresses[0]"},
  };
  ExpectRefused(R"({"adapters": [{"name": "hba0"}, {"name": "hba1", )", "}]}", "adapters[1]", adapters);
}

TEST(HostDescription, FaultsOfTheDocumentDoNotRepeatIt) {
  const Harness host("{}");
  for (const char* text :
       {"{\"secret\": \"hush", "{\"secret\": \"hush; last read: \\q\"}", "{\"secret\" \"hush\"}",
        "{\"secret\": \"hush\"} x", "{\"secret\": hush}", "{\"secret\": \"hush\xff\"}"}) {
    EXPECT_THAT([&] { simulator::Load(text); },
                ThrowsMessage<host::Error>(AllOf(HasSubstr("line 1, column"), Not(HasSubstr("hush")))));
  }
}

TEST(HostDescription, TextsThatCannotBeStoredAreNotRepeated) {
  host::Record record;
  EXPECT_THAT([&] { record.Set("chap/secret", "hush\xff"); },
              ThrowsMessage<host::Error>("The text for \"chap/secret\" is not UTF-8."));
  EXPECT_THAT([&] { record.Set("chap/secret", std::string("hush\0", 5)); },
              ThrowsMessage<host::Error>("The text for \"chap/secret\" has a zero byte."));
}

TEST(HostDescription, OnlyDefaultsComeOnTopOfWhatWasWritten) {
  const Harness host{std::string(simulator::DemoDescription())};
  const json written = json::parse(simulator::DemoDescription()).flatten();
  for (const auto& [pointer, value] : written.items()) EXPECT_EQ(host.Show(pointer), value) << pointer;
}

/// Lets the process read standard input from the file, behind its first bytes.
class StandardInput {
 public:
  StandardInput(const std::string& file, off_t taken) : before_(dup(STDIN_FILENO)) {
    close(STDIN_FILENO);
    EXPECT_EQ(open(file.c_str(), O_RDONLY), STDIN_FILENO);
    EXPECT_EQ(lseek(STDIN_FILENO, taken, SEEK_SET), taken);
  }
  StandardInput(const StandardInput&) = delete;
  StandardInput& operator=(const StandardInput&) = delete;
  ~StandardInput() {
    dup2(before_, STDIN_FILENO);
    close(before_);
  }

 private:
  int before_;
};

TEST(HostDescription, Commands) {
  TemporaryRoot root;
  Harness host(R"({"adapters": [{"name": "hba7", "alias": "\u00fc"}]})");
  const auto load = [&](const std::string& file) { return host(simulator::NewLoad(), file); };
  const auto shown = host(simulator::NewShow(), "--secrets");
  EXPECT_EQ(json::parse(shown.result.get<std::string>()), host.Show());
  const std::string file = root.Path() + "/description.json";
  std::ofstream(file) << R"({"adapters": [{"name": 3}]})";
  EXPECT_THAT(load(file).messages,
              ElementsAre(file + ": adapters[0].name: expected a text (line 1, column 24)"));
  const std::string none = root.Path() + "/none";
  EXPECT_THAT(load(none).messages, ElementsAre("There is no file " + none + "."));
  EXPECT_THAT(load(root.Path()).messages,
              ElementsAre("The file " + root.Path() + " cannot be read: Is a directory."));
  EXPECT_THAT(load(file + "/x").messages,
              ElementsAre("The file " + file + "/x cannot be read: Not a directory."));
  const std::string large = root.Path() + "/large.json";
  std::ofstream(large) << "{";
  std::filesystem::resize_file(large, (std::size_t{1} << 30U) + 1);
  EXPECT_THAT(
      load(large).messages,
      ElementsAre("The file " + large + " has more than 1073741824 bytes, the most that can be read."));
  EXPECT_EQ(host.Show("/adapters/0/name"), "hba7");
  std::ofstream(file) << "taken"
                      << R"({"adapters": [{"name": "hba8"}]})";
  {
    const StandardInput input(file, 5);
    EXPECT_EQ(load("-").result, true);
  }
  EXPECT_EQ(host.Show("/adapters/0/name"), "hba8");
  EXPECT_EQ(host(simulator::NewReset(), "").result, true);
  EXPECT_EQ(host.Show("/adapters/0/name"), "hba0");
  // A host that cannot be used makes each of them fail.
  std::filesystem::create_directories(root.Path() + "/var/lib/tessaro");
  std::ofstream(root.Path() + "/var/lib/tessaro/host.db") << "x";
  host::Host::Use(nullptr);
  const auto refused = HasSubstr("is not a host database");
  EXPECT_THAT(host(simulator::NewReset(), "").messages.at(0), refused);
  EXPECT_THAT(host(simulator::NewShow(), "").messages.at(0), refused);
  EXPECT_THAT(host(simulator::NewReboot(), "").messages.at(0), refused);
}

TEST(HostDescription, DocumentationIsComplete) {
  const std::string file = "docs/host-description.md";
  const std::string text = FileText(file);
  const std::size_t begin = text.find("-->\n\n") + 5;
  ASSERT_GT(begin, 5u) << file;
  const std::string tables = host::SchemaTables();
  if (std::getenv("HCLI_WRITE_DOCS") != nullptr)
    std::ofstream(ProjectFile(file)) << text.substr(0, begin) << tables;
  EXPECT_TRUE(text.substr(begin) == tables)
      << file << " is not what the schema says; HCLI_WRITE_DOCS=1 writes it anew";
}

}  // namespace
