// Changes that wait for a reset or a reboot: what shows before and after, and what can be taken back.
#include <algorithm>

#include "host/Host.h"
#include "simulator/Commands.h"
#include "simulator/Simulator.h"
#include "support/Harness.h"

namespace {

using nlohmann::json;
using testing::ElementsAre;
using testing::IsEmpty;

constexpr char kReboot[] = "Reboot required to complete operation.";

/// An adapter "a0" that can set everything, with a static target; @p keys are changed in it.
std::string HostWith(const std::string& keys) {
  json host = json::parse(R"({"adapters": [{"name": "a0", "initiatorName": "iqn.2026-11.org.example:old",
      "capabilities": {"MTU Settable": true, "ARP Redirect Settable": true, "Name And Alias Settable": true,
                       "Subnet Mask Setttable": true, "Default Gateway Settable": true, "ISnS Settable": true,
                       "IP Configuration Method Settable": true, "Adapter Header Digest Supported": true,
                       "Inheritance Supported": true},
      "network": {"ipv4Address": "192.0.2.9", "ipv4Netmask": "255.255.255.0", "gateway": "192.0.2.1"},
      "staticTargets": [{"name": "iqn.2026-11.org.example:t", "host": "192.0.2.10"}]}]})");
  host["adapters"][0].update(json::parse(keys), true);
  return host.dump();
}

Outcome Reboot(Harness& host) { return host(simulator::NewReboot(), ""); }

/// What a command shows: a field of its first row, or of the row of a parameter.
json Field(Harness& host, const std::string& line, const std::string& field, const std::string& option) {
  for (const json& row : host(line).result) {
    if (option.empty() || row.value("Option", row.value("Name", "")) == option) return row[field];
  }
  ADD_FAILURE() << line << " shows no " << option;
  return {};
}

struct Setting {
  const char* group;
  std::string set;
  std::string get;
  const char* field;
  const char* option;
  json before;
  json after;
  bool configured;  // it shows at once what is configured: it is read, changed and written back as a whole
  bool silent = false;  // the command does not look at the status
};

const std::string kPlace = " -A a0 -a 192.0.2.10 -n iqn.2026-11.org.example:t";
const Setting kSettings[] = {
    {"identity", "adapter set -A a0 -n iqn.2026-11.org.example:new", "adapter get -A a0", "Name", "",
     "iqn.2026-11.org.example:old", "iqn.2026-11.org.example:new", false},
    {"mtu", "physicalnetworkportal param set -A a0 -o MTU -v 9000", "physicalnetworkportal param get -A a0",
     "Value", "MTU", 1500, 9000, false},
    {"arpRedirect", "physicalnetworkportal param set -A a0 -o ArpRedirect -v 1",
     "physicalnetworkportal param get -A a0", "Value", "ArpRedirect", 0, 1, false},
    {"network", "networkportal ipconfig set -A a0 -i 198.51.100.9 -s 255.255.0.0 -g 198.51.0.1",
     "networkportal ipconfig get -A a0", "Gateway", "", "192.0.2.1", "198.51.0.1", false},
    {"parameters", "adapter param set -A a0 -k MaxBurstLength -v 1024", "adapter param get -A a0", "Current",
     "MaxBurstLength", "262144", "1024", true},
    {"parameters", "adapter param set -A a0 -k HeaderDigest -v required", "adapter param get -A a0",
     "Current", "HeaderDigest", "prohibited", "required", true},
    {"parameters", "adapter target portal param set -k MaxBurstLength -v 1024" + kPlace,
     "adapter target portal param get" + kPlace, "Current", "MaxBurstLength", "262144", "1024", true, true},
};

TEST(Pending, TakesEffectWhenTheAdapterSaysSo) {
  for (const Setting& setting : kSettings) {
    for (const std::string when : {"now", "reset", "reboot"}) {
      SCOPED_TRACE(when + ": " + setting.set);
      Harness host(HostWith(R"({"applies": {")" + std::string(setting.group) + R"(": ")" + when + R"("}})"));
      const auto shown = [&] { return Field(host, "iscsi " + setting.get, setting.field, setting.option); };
      EXPECT_EQ(shown(), setting.before);
      const Outcome run = host("iscsi " + setting.set);
      const bool asked = when == "reboot" && !setting.silent;
      const bool waits = when == "reboot" || (when == "reset" && setting.silent);
      if (setting.group == std::string("network")) {
        EXPECT_EQ(run.result.get<std::string>().starts_with("Reboot required for operation 'ip'. "), asked);
      } else {
        EXPECT_EQ(run.messages, asked ? std::vector<std::string>{kReboot} : std::vector<std::string>{});
      }
      const auto calls = run.Calls();
      EXPECT_EQ(std::count(calls.begin(), calls.end(), "ResetAdapter"), when == "reset" && !setting.silent);
      EXPECT_EQ(shown(), waits && !setting.configured ? setting.before : setting.after);

      // Both are in the description, and load brings both back.
      const std::string described = simulator::Show(true);
      EXPECT_EQ(described.find("\"pending\"") != described.npos, waits);
      simulator::Load(described);
      EXPECT_EQ(simulator::Show(true), described);

      EXPECT_EQ(Reboot(host).result, true);
      EXPECT_EQ(shown(), setting.after);
      EXPECT_EQ(simulator::Show(true).find("\"pending\""), std::string::npos);
    }
  }
}

TEST(Pending, WhatWaitsCanBeTakenBackAndIsKeptBySetsOfOthers) {
  Harness host(HostWith(R"({"applies": {"mtu": "reboot", "parameters": "reboot"}})"));
  const std::string before = simulator::Show(true);
  const auto mtu = [&](const char* value) {
    return host(std::string("iscsi physicalnetworkportal param set -A a0 -o MTU -v ") + value).messages;
  };
  EXPECT_THAT(mtu("9000"), ElementsAre(kReboot));
  EXPECT_THAT(mtu("9000"), ElementsAre(kReboot));
  EXPECT_THAT(mtu("1500"), IsEmpty());
  EXPECT_EQ(simulator::Show(true), before);

  // The second set is written back whole, and must not take the first one back.
  host("iscsi adapter param set -A a0 -k MaxCmds -v 64");
  host("iscsi adapter param set -A a0 -k MaxBurstLength -v 1024");
  EXPECT_EQ(host.Show("/adapters/0/parameters"), json::object());
  Reboot(host);
  EXPECT_EQ(host.Show("/adapters/0/parameters/MaxCmds/current"), 64);
  EXPECT_EQ(host.Show("/adapters/0/parameters/MaxBurstLength/current"), 1024);
}

TEST(Pending, ParametersThatTheDescriptionDoesNotNameAreTakenBack) {
  for (const char* line :
       {"-k LoginTimeout -v 20|-k LoginTimeout -v 15", "-k HeaderDigest -v required|-k HeaderDigest -D"}) {
    Harness host(HostWith(R"({"applies": {"parameters": "reboot"}})"));
    const std::string before = simulator::Show(true);
    const std::string lines = line;
    const std::string set = "iscsi adapter param set -A a0 ";
    for (int time = 0; time < 2; ++time) {
      EXPECT_THAT(host(set + lines.substr(0, lines.find('|'))).messages, ElementsAre(kReboot)) << line;
    }
    EXPECT_THAT(host(set + lines.substr(lines.find('|') + 1)).messages, IsEmpty()) << line;
    EXPECT_EQ(simulator::Show(true), before);
  }
}

TEST(Pending, AResetThatFailedIsAskedForAgain) {
  Harness host(WithAnswers(HostWith(R"({"applies": {"parameters": "reset"}})"),
                           R"({"operation": "ResetAdapter", "throw": "NodeCtlException", "call": 1})"));
  const std::string set = "iscsi adapter param set -A a0 -k MaxCmds -v 64";
  EXPECT_EQ(host(set).status, 1);
  EXPECT_EQ(host.Show("/adapters/0/parameters"), json::object());
  EXPECT_EQ(host(set).result, true);
  EXPECT_EQ(host.Show("/adapters/0/parameters/MaxCmds/current"), 64);
}

// Commands show the addresses in effect, and ask again for what waits.
TEST(Pending, AddressesAreAddedAndRemovedOnceMore) {
  Harness host(HostWith(R"({"applies": {"network": "reboot"}, "capabilities": {"IPv6 Supported": true},
      "network": {"ipv6Enabled": true, "ipv6Addresses": [{"address": "2001:db8::1"}]}})"));
  for (int time = 0; time < 2; ++time) {
    const Outcome run = host("iscsi networkportal ipv6config address add -A a0 -r -a 2001:db8::2/64");
    EXPECT_EQ(run.result, "Reboot required. Reboot required. ");
    EXPECT_EQ(host.Show("/adapters/0/pending/reboot/network/ipv6Addresses/0/address"), "2001:db8::2");
  }
}

TEST(Pending, AResetLeavesWhatWaitsForAReboot) {
  Harness host(HostWith(R"({"applies": {"identity": "reboot", "arpRedirect": "reset"}, "targets": [
      {"name": "iqn.2026-11.org.example:t", "sessions": [{"isid": "80107e020001"}]}]})"));
  host("iscsi adapter set -A a0 -a lab");
  host("iscsi physicalnetworkportal param set -A a0 -o ArpRedirect -v 1");
  EXPECT_EQ(host.Show("/adapters/0/network/arpRedirect"), true);
  EXPECT_EQ(host.Show("/adapters/0/alias"), "");
  EXPECT_EQ(host.Show("/adapters/0/pending"), json::parse(R"({"reboot": {"alias": "lab"}})"));
  EXPECT_EQ(host("iscsi session list").result, json::array());  // the network does not let it in again
}

TEST(Pending, OfWhatWaitsForBothTheRebootHasTheLastWord) {
  Harness host(HostWith(R"({"pending": {"reset": {"parameters": {"MaxCmds": {"current": 64}}},
                                        "reboot": {"parameters": {"MaxCmds": {"current": 32}}}},
                            "parameters": {"MaxCmds": {"current": 16}}})"));
  EXPECT_EQ(Field(host, "iscsi adapter param get -A a0", "Current", "MaxCmds"), "32");
  Reboot(host);
  EXPECT_EQ(host.Show("/adapters/0/parameters/MaxCmds/current"), 32);
}

TEST(Pending, InheritanceWaitsToo) {
  Harness host(HostWith(R"({"applies": {"parameters": "reboot"},
      "staticTargets": [{"name": "iqn.2026-11.org.example:t", "host": "192.0.2.10",
                         "parameters": {"MaxCmds": 64}}]})"));
  const Outcome run = host("iscsi adapter target portal param set -k MaxCmds -I" + kPlace);
  EXPECT_EQ(run.result, true) << run.failure;
  EXPECT_EQ(host.Show("/adapters/0/staticTargets/0/pending/reboot/parameters"), (json{{"MaxCmds", nullptr}}));
  simulator::Load(host.Show().dump());
  EXPECT_EQ(host.Show("/adapters/0/staticTargets/0/parameters/MaxCmds"), 64);
  Reboot(host);
  EXPECT_EQ(host.Show("/adapters/0/staticTargets/0/parameters"), json::object());
}

TEST(Pending, ChapNeverWaits) {
  Harness host(HostWith(R"({"applies": {"parameters": "reboot"},
      "capabilities": {"CHAP Authorization Supported": true, "Target Level Authentication Supported": true}})"));
  const std::string set = "iscsi adapter target portal auth chap set -l required -N me -S secret-of-mine-1";
  EXPECT_EQ(host(set + kPlace).result, true);
  EXPECT_EQ(host.Show("/adapters/0/staticTargets/0/chap/uni/secret"), "secret-of-mine-1");
  EXPECT_FALSE(host.Show("/adapters/0/staticTargets/0").contains("pending"));
}

}  // namespace
