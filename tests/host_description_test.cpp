// Descriptions: what is read, what is refused and where, what is shown.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>

#include "host/Description.h"
#include "host/Error.h"
#include "host/Host.h"
#include "host/Schema.h"
#include "simulator/Commands.h"
#include "support/Harness.h"
#include "support/ProjectFile.h"

using nlohmann::json;
using testing::HasSubstr;

namespace {

TEST(HostDescription, FaultsNameTheirPath) {
  const std::string one = R"({"adapters": [{"name": "hba0"}, {"name": "hba1", )";
  const struct {
    std::string description;
    std::string fault;
  } cases[] = {
      {"", "not a JSON document: parse error at line 1, column 1"},
      {"{\n\"adapters\": [,]}", "not a JSON document: parse error at line 2"},
      {"{} {}", "not a JSON document"},
      {R"({"state": 1e999})", "the document has a number that is too large"},
      {"[]", "expected an object in braces"},
      {R"({"adapters": {}})", "adapters: expected a list"},
      {R"({"adapters": [1]})", "adapters[0]: expected an object in braces"},
      {R"({"adapter": []})", "adapter: unknown key; did you mean \"adapters\"?"},
      {R"({"zzzzzzzzzzz": []})", "zzzzzzzzzzz: unknown key"},
      {R"({"adapters": [{}]})", "adapters[0].name: missing, and required"},
      {R"({"adapters": [{"name": ""}]})", "adapters[0].name: must not be empty"},
      {R"({"adapters": [{"name": 3}]})", "adapters[0].name: expected a text"},
      {R"({"adapters": [{"name": "a\u0000b"}]})", "adapters[0].name: a text cannot hold a zero character"},
      {R"({"adapters": [{"name": "x"}, {"name": "y"}, {"name": "x"}]})",
       "adapters[2].name: \"x\" is taken by adapters[0]"},
      {R"({"adapters": [{"name": "x"}, {"name": "x", "name": "y"}]})", "adapters[1].name: is given twice"},
      {R"({"softwareIscsi": {"enabled": 1}})", "softwareIscsi.enabled: expected true or false"},
      {one + R"("capabilities": {"MTU Settable": "yes"}}]})",
       "adapters[1].capabilities.MTU Settable: expected true or false"},
      {one + R"("capabilities": {"Subnet Mask Settable": true}}]})",
       "adapters[1].capabilities.Subnet Mask Settable: unknown key; did you mean \"Subnet Mask Setttable\"?"},
      {one + R"("kind": "soft"}]})",
       "adapters[1].kind: expected one of \"independent\", \"dependent\", \"software\", \"scsi\""},
      {one + R"("state": 2147483648}]})",
       "adapters[1].state: expected a whole number from -2147483648 to 2147483647"},
      {one + R"("state": 18446744073709551615}]})", "adapters[1].state: expected a whole number"},
      {one + R"("state": 99999999999999999999999}]})", "adapters[1].state: expected a whole number"},
      {one + R"("state": 0.5}]})", "adapters[1].state: expected a whole number"},
      {one + R"("initiatorName": "host1"}]})", "adapters[1].initiatorName: it must begin with"},
      {one + R"("applies": {"mtu": "later"}}]})", "adapters[1].applies.mtu: expected one of \"now\""},
      {one + R"("applies": {"MTU": "now"}}]})", "adapters[1].applies.MTU: unknown key"},
      {one + R"("pending": {"boot": {}}}]})", "adapters[1].pending.boot: unknown key"},
      {one + R"("pending": {"reboot": {"network": {"mtu": true}}}}]})",
       "adapters[1].pending.reboot.network.mtu: expected a whole number"},
      {one + R"("pending": {"reset": {"name": "a1"}}}]})", "adapters[1].pending.reset.name: unknown key"},
      {one + R"("pending": {"reset": {"alias": null}}}]})",
       "adapters[1].pending.reset.alias: expected a text"},
      {one + R"("pending": {"reset": {"parameters": {"MaxCmds": {"current": 1}}}}}]})",
       "adapters[1].pending: parameters.MaxCmds.current: 1 is not from min"},
      {R"({"answers": [{"operation": "GetNames", "throw": "bad_alloc"}]})",
       "answers[0].operation: no operation is called \"GetNames\"; did you mean \"GetName\"?"},
      {R"({"answers": [{"operation": "GetName"}]})", "answers[0]: expected exactly one of"},
      {R"({"answers": [{"operation": "SetMtu", "status": 1, "throw": "bad_alloc"}]})",
       "answers[0]: expected exactly one of"},
      {R"({"answers": [{"operation": "GetName", "status": 1}]})",
       "answers[0].status: GetName gives no status"},
      {R"({"answers": [{"operation": "GetName", "imaStatus": 1}]})",
       "answers[0].imaStatus: GetName is no IMA call"},
      {R"({"answers": [{"operation": "IMA_GetLhbaOidList", "throw": "bad_alloc"}]})",
       "answers[0]: IMA_GetLhbaOidList can be answered by an \"imaStatus\" only"},
      {R"({"answers": [{"operation": "SetMtu", "status": 1, "text": "x"}]})",
       "answers[0].text: goes with \"throw\" only"},
      {R"({"answers": [{"operation": "SetMtu", "status": 1, "call": 0}]})",
       "answers[0].call: expected a whole"},
      {one + R"("parameters": {"MaxCmds": {"max": 2147483648}}}]})",
       "adapters[1].parameters.MaxCmds.max: expected a whole number from -2147483648 to 2147483647"},
      {one + R"("parameters": {"MaxCmds": {"current": 1}}}]})",
       "adapters[1].parameters.MaxCmds.current: 1 is not from min, 2, to max, 2048"},
      {one +
           R"("parameters": {"MaxCmds": {"max": 200}}, "sendTargets": [{"host": "a", "parameters": {"MaxCmds": 201}}]}]})",
       "adapters[1].sendTargets[0].parameters.MaxCmds: 201 is not from min, 2, to max, 200"},
      {one +
           R"("staticTargets": [{"name": "t", "host": "a", "pending": {"reset": {"parameters": {"MaxCmds": 1}}}}]}]})",
       "adapters[1].staticTargets[0].pending: parameters.MaxCmds: 1 is not from min"},
      {one +
           R"("sendTargets": [{"host": "Storage"}, {"host": "storage", "port": 860}, {"host": "sTORAGE"}]}]})",
       "adapters[1].sendTargets[2].host: \"storage 3260\" is taken by adapters[1].sendTargets[0]"},
      {one + R"("isnsServers": [{"address": "2001:DB8::1"}]}]})",
       "adapters[1].isnsServers[0].address: expected \"2001:db8::1\", the same address in its canonical "
       "form"},
      {one + R"("targets": [{"name": "t", "addresses": [{"address": "FE80::1"}]}]}]})",
       "adapters[1].targets[0].addresses[0].address: expected \"fe80::1\", the same address"},
      {one + R"("kind": "dependent", "networkPortals": [{"nic": "ghost"}]}]})",
       "adapters[1].networkPortals[0].nic: the host has no NIC \"ghost\""},
      {one + R"("networkPortals": [{"nic": "n"}]}], "nics": [{"name": "n"}]})",
       "adapters[1].networkPortals[0]: only a software or dependent adapter"},
      {one + R"("kind": "dependent", "logicalPortals": [{"name": "p"}]}]})",
       "adapters[1].logicalPortals[0]: only an independent adapter"},
      {one +
           R"("network": {"ipv6Addresses": [{"address": "::2"}, {"address": "0::2", "prefixLength": 9}]}}]})",
       "adapters[1].network.ipv6Addresses[1].address: \"0::2\" is taken by network.ipv6Addresses[0]"},
      {R"({"nics": [{"name": "n", "ipv6Addresses": [{"address": "::2"}, {"address": "::2"}]}]})",
       "nics[0].ipv6Addresses[1].address: \"::2\" is taken by ipv6Addresses[0]"},
      {R"({"bootTables": [{"lun": "9223372036854775808"}]})",
       "bootTables[0].lun: expected a whole number from 0 to 9223372036854775807"},
      {R"({"bootTables": [{"chapPwd": "***"}]})", "bootTables[0].chapPwd: \"***\" stands for a secret"},
      {R"({"remoteTargets": [{"name": "t", "chap": {"secret": "***"}}]})",
       "remoteTargets[0].chap.secret: \"***\" stands for a secret that was not shown; simulator show "
       "--secrets"},
  };
  for (const auto& [description, fault] : cases) {
    const Harness host(R"({"adapters": [{"name": "before"}]})");
    const std::string before = host::Host::Current().Show(true);
    try {
      host::Host::Current().Load(description);
      ADD_FAILURE() << description;
    } catch (const host::Error& error) {
      EXPECT_THAT(error.what(), testing::StartsWith(fault)) << description;
    }
    EXPECT_EQ(host::Host::Current().Show(true), before) << description;
  }
}

TEST(HostDescription, FaultsOfTheDocumentDoNotRepeatIt) {
  for (const char* text :
       {"{\"secret\": \"hush", "{\"secret\": \"hush; last read: \\q\"}", "{\"secret\" \"hush\"}",
        "{\"secret\": \"hush\"} x", "{\"secret\": hush}", "{\"secret\": \"hush\xff\"}"}) {
    const Harness host("{}");
    try {
      host::Host::Current().Load(text);
      ADD_FAILURE() << text;
    } catch (const host::Error& error) {
      EXPECT_THAT(error.what(), testing::AllOf(HasSubstr("line 1, column"), testing::Not(HasSubstr("hush"))));
    }
  }
}

TEST(HostDescription, WhatIsShownLoads) {
  Harness host{std::string(host::DemoDescription())};
  const std::string shown = host::Host::Current().Show(true);
  host::Host::Current().Load("{}");
  EXPECT_EQ(host.Show("/adapters"), json::array());
  host::Host::Current().Load(shown);
  EXPECT_EQ(host::Host::Current().Show(true), shown);
  // Only defaults come on top of what was written.
  const json written = json::parse(host::DemoDescription()).flatten();
  for (const auto& [pointer, value] : written.items()) EXPECT_EQ(host.Show(pointer), value) << pointer;
}

TEST(HostDescription, Commands) {
  TemporaryRoot root;
  Harness host(R"({"adapters": [{"name": "hba7", "alias": "\u00fc"}]})");
  const auto load = [&](const std::string& file) {
    return host("SimulatorLoad", simulator::NewLoad(), file);
  };
  const auto shown = host("SimulatorShow", simulator::NewShow(), "--secrets");
  EXPECT_EQ(json::parse(shown.result.get<std::string>()), host.Show());
  const std::string file = root.Path() + "/description.json";
  std::ofstream(file) << R"({"adapters": [{"name": 3}]})";
  EXPECT_THAT(load(file).messages, testing::ElementsAre(file + ": adapters[0].name: expected a text"));
  const std::string none = root.Path() + "/none";
  EXPECT_THAT(load(none).messages, testing::ElementsAre("There is no file " + none + "."));
  EXPECT_EQ(host.Show("/adapters/0/name"), "hba7");
  std::ofstream(file) << R"({"adapters": [{"name": "hba8"}]})";
  EXPECT_EQ(load(file).result, true);
  EXPECT_EQ(host.Show("/adapters/0/name"), "hba8");
  EXPECT_EQ(host("SimulatorReset", simulator::NewReset(), "").result, true);
  EXPECT_EQ(host.Show("/adapters/0/name"), "hba0");
  // A host that cannot be used makes each of them fail.
  std::filesystem::create_directories(root.Path() + "/var/lib/tessaro");
  std::ofstream(root.Path() + "/var/lib/tessaro/host.db") << "x";
  host::Host::Use(nullptr);
  const auto refused = HasSubstr("is not a host database");
  EXPECT_THAT(host("SimulatorReset", simulator::NewReset(), "").messages.at(0), refused);
  EXPECT_THAT(host("SimulatorShow", simulator::NewShow(), "").messages.at(0), refused);
  EXPECT_THAT(host("SimulatorReboot", simulator::NewReboot(), "").messages.at(0), refused);
}

TEST(HostDescription, DocumentationIsComplete) {
  const std::string file = ProjectFile("docs/host-description.md");
  std::ostringstream stream;
  stream << std::ifstream(file).rdbuf();
  const std::string text = stream.str();
  const std::size_t begin = text.find("-->\n\n") + 5;
  ASSERT_GT(begin, 5u) << file;
  const std::string tables = host::SchemaTables();
  if (std::getenv("HCLI_WRITE_DOCS") != nullptr) std::ofstream(file) << text.substr(0, begin) << tables;
  EXPECT_TRUE(text.substr(begin) == tables)
      << file << " is not what the schema says; HCLI_WRITE_DOCS=1 writes it anew";
}

}  // namespace
