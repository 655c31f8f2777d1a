// iscsi networkportal ipconfig get|set, ipv6config get|set and ipv6config address add|list|remove.
#include "support/Harness.h"

namespace {

using nlohmann::json;
using testing::IsEmpty;

/// An adapter "a0" that can set everything, with @p network changed in its network configuration.
json HostWith(const json& network = json::object()) {
  json host = json::parse(R"({"adapters": [{"name": "a0", "capabilities": {
      "IPv6 Supported": true, "IPv4 Enable Settable": true, "IP Configuration Method Settable": true,
      "Subnet Mask Setttable": true, "Default Gateway Settable": true, "IPv6 Enable Settable": true,
      "IPv6 DHCP Configuration Method Settable": true, "IPv6 Linklocal Auto Configuration Method Settable": true,
      "IPv6 Router Advertisement Configuration Method Settable": true, "IPv6 Default Gateway Settable": true,
      "Primary DNS Settable": true, "Secondary DNS Settable": true},
      "logicalPortals": [{"name": "p0"}, {"name": "p1"}],
      "network": {"ipv4Address": "192.0.2.9", "ipv4Netmask": "255.255.255.0", "gateway": "192.0.2.1",
                  "ipv6Enabled": true, "primaryDns": "192.0.2.53",
                  "ipv6Addresses": [{"address": "fe80::9", "type": 7}, {"address": "2001:db8::1"},
                                    {"address": "2001:db8::2", "type": 9}, {"address": "2001:db8::3", "type": 7}]}}]})");
  host["adapters"][0]["network"].update(network);
  return host;
}

json Without(const std::string& capability) {
  json host = HostWith();
  host["adapters"][0]["capabilities"].erase(capability);
  return host;
}

std::string Joined(const std::vector<std::string>& texts) {
  std::string joined;
  for (const std::string& text : texts) joined += (joined.empty() ? "" : "; ") + text;
  return joined;
}

/// The trace behind the lookup of the adapter, without the adapter's name and the outcomes of what succeeded.
std::string Steps(const Outcome& run) {
  std::vector<std::string> steps;
  for (std::string line : run.trace) {
    if (line.starts_with("GetScsiInterface")) continue;
    const std::size_t name = line.find("(a0");
    line.erase(name + 1, line[name + 3] == ',' ? 4 : 2);
    for (const char* outcome : {" = ok", " = 0"}) {
      if (line.ends_with(outcome)) line.resize(line.rfind(outcome));
    }
    steps.push_back(line);
  }
  return Joined(steps);
}

// What becomes of the statuses of changes.

const struct {
  const char* line;
  const char* setters;  ///< operations that give a status, in order
  const char* reboots;  ///< the sentences of all
} kRows[] = {
    {"ipconfig set -A a0 -e true -d false -i 192.0.2.7 -s 255.255.255.128 -g 192.0.2.2 -x 192.0.2.3 -y "
     "192.0.2.4",
     "SetIpVersionEnabled; SetUseDhcpv4; SetIpv4Address; SetIpv4SubnetMask; SetIpv4Gateway; SetDnsServers",
     "Reboot required for operation 'enable'. Reboot required for operation 'enable-dhcpv4'. "
     "Reboot required for operation 'ip'. Reboot required for operation 'subnet'. "
     "Reboot required for operation 'gateway'. Reboot required for operation 'dns'. "},
    {"ipv6config set -A a0 -g 2001:db8::99 -r true -l false -d true -e no",
     "SetIpVersionEnabled; SetIpv6ConfigMethod; SetIpv6ConfigMethod; SetIpv6ConfigMethod; SetIpv6Gateway",
     "Reboot required for operation 'enable'. Reboot required for operation 'enable-dhcpv6'. "
     "Reboot required for operation 'enable-linklocal-autoconfiguration'. "
     "Reboot required for operation 'enable-router-advertisement'. "
     "Reboot required for operation 'set-gateway6'. "},
    {"ipv6config address add -A a0 -r -a 2001:db8::5/64",
     "SetIpv6Address; SetIpv6Address; SetIpv6Address; SetIpv6Address",
     "Reboot required. Reboot required. Reboot required. Reboot required. "},
    {"ipv6config address remove -A a0 -a 2001:db8::1/64 -a fe80::9/64", "SetIpv6Address; SetIpv6Address",
     "Reboot required. Reboot required. "},
};

TEST(ChangeRows, StatusesBecomeSentencesAndOneReset) {
  for (const auto& row : kRows) {
    for (const int status : {1, 2, 3, 4}) {
      json description = HostWith();
      for (const char* setter :
           {"SetIpVersionEnabled", "SetUseDhcpv4", "SetIpv4Address", "SetIpv4SubnetMask", "SetIpv4Gateway",
            "SetDnsServers", "SetIpv6ConfigMethod", "SetIpv6Gateway", "SetIpv6Address"}) {
        description["answers"].push_back({{"operation", setter}, {"status", status}});
      }
      const Outcome run = Harness(description.dump())(std::string("iscsi networkportal ") + row.line);
      SCOPED_TRACE(row.line + std::to_string(status));
      EXPECT_EQ(run.result, status == 1 ? row.reboots : "");
      EXPECT_THAT(run.messages, IsEmpty());
      std::vector<std::string> changes = run.Calls();
      std::erase_if(changes, [](const std::string& call) { return call.starts_with("Get"); });
      EXPECT_EQ(Joined(changes), row.setters + std::string(status == 2 ? "; ResetAdapter" : ""));
    }
  }
}

TEST(RemovalWalk, NotesNothingOnceAResetIsToBeDone) {
  json description = HostWith();
  const int statuses[] = {1, 2, 1, 1};
  for (int call = 1; call <= 4; ++call) {
    description["answers"].push_back(
        {{"operation", "SetIpv6Address"}, {"call", call}, {"status", statuses[call - 1]}});
  }
  const auto run = [&](const std::string& line) {
    return Harness(description.dump())("iscsi networkportal ipv6config address " + line).result;
  };
  // The adding walk looks at every status.
  EXPECT_EQ(run("add -A a0 -r -a 2001:db8::5/64"), "Reboot required. Reboot required. ");
  EXPECT_EQ(run("remove -A a0 -a 2001:db8::1/64 -a 2001:db8::2/64 -a 2001:db8::3/64"), "Reboot required. ");
}

// One command at a time: what is called, what is said, what is stored.

struct Case {
  const char* line;
  std::string steps;
  std::string messages;
  std::string stored = "{}";  ///< changed keys of the network configuration
  json host = HostWith();
};

/// A case in which the library refuses the last of the steps.
Case Refused(const char* line, const std::string& steps, const std::string& reason, const char* failure,
             const json& host = HostWith(), const std::string& stored = "{}") {
  return {line, steps + " ! NodeCtlException: " + reason, failure + ("; " + reason), stored, host};
}

constexpr char kGet[] = "GetNetworkProperties()";

template <std::size_t count>
void Check(const std::string& command, const Case (&cases)[count]) {
  for (const Case& c : cases) {
    SCOPED_TRACE(command + " " + c.line);
    Harness host(c.host.dump());
    json expected = host.Show("/adapters/0/network");
    expected.update(json::parse(c.stored));
    const Outcome run = host("iscsi networkportal " + command + " -A a0 " + c.line);
    EXPECT_EQ(Steps(run), c.steps);
    EXPECT_EQ(Joined(run.messages), c.messages);
    EXPECT_EQ(run.result, c.messages.empty() ? json("") : json());
    EXPECT_EQ(host.Show("/adapters/0/network"), expected);
  }
}

TEST(IpconfigSet, StepsMessagesAndStore) {
  constexpr char kDhcp[] =
      "Cannot set static IPv4 configuration, as DHCPv4 is enabled for adapter a0. You need to first disable "
      "DHCPv4.";
  const std::string failed = "Failed to set IP configuration on network portal.";
  const std::string get = std::string(kGet) + "; ";
  const json dhcp = HostWith({{"useDhcpv4", true}});
  const auto refused = [&](const char* line, const std::string& call, const char* reason,
                           const json& host = HostWith()) {
    return Refused(line, get + call, reason, failed.c_str(), host);
  };
  const Case cases[] = {
      {"-n nosuch", "", ""},
      {"-e false -i 1 -d true", "SetIpVersionEnabled(4, false)", "", R"({"ipv4Enabled": false})"},
      {"-e true -d false -i 198.51.100.7 -s 255.255.254.0 -g 198.51.101.1",
       R"(SetIpVersionEnabled(4, true); SetUseDhcpv4(false); SetIpv4Address("198.51.100.7"); )"
       R"(SetIpv4SubnetMask("255.255.254.0"); SetIpv4Gateway("198.51.101.1"))",
       "",
       R"({"useDhcpv4": false, "ipv4Address": "198.51.100.7", "ipv4Netmask": "255.255.254.0",
               "gateway": "198.51.101.1"})",
       dhcp},
      {"-d true -g x", "SetUseDhcpv4(true)", "", R"({"useDhcpv4": true})"},
      {"-i 192.0.2.7", kGet, kDhcp, "{}", dhcp},
      {"-y 2001:db8::53", get + R"(SetDnsServers("", "2001:db8::53"))", "",
       R"({"primaryDns": "", "secondaryDns": "2001:db8::53"})"},
      {"-g 0.0.0.0", get + R"(SetIpv4Gateway("0.0.0.0"))", "", R"({"gateway": "0.0.0.0"})"},
      {"-g 1.2.3", kGet, failed + R"(; "1.2.3" is not an IPv4 address.)"},
      refused(
          "-g 192.0.3.1", R"(SetIpv4Gateway("192.0.3.1"))",
          R"(The gateway "192.0.3.1" is not in the subnet of the address "192.0.2.9" with the mask "255.255.255.0".)"),
      refused("-i 224.0.0.1", R"(SetIpv4Address("224.0.0.1"))", R"("224.0.0.1" is not a unicast address.)"),
      refused("-s 255.0.255.0", R"(SetIpv4SubnetMask("255.0.255.0"))",
              R"("255.0.255.0" is not a subnet mask: its one bits must stand in front of its zero bits.)"),
      refused("-s 0.0.0.0", R"(SetIpv4SubnetMask("0.0.0.0"))",
              R"("0.0.0.0" is not a subnet mask: its one bits must stand in front of its zero bits.)"),
      refused("-x dns.example", R"(SetDnsServers("dns.example", ""))",
              R"("dns.example" is not an IP address.)"),
      refused("-s 255.0.0.0", R"(SetIpv4SubnetMask("255.0.0.0"))",
              R"(The subnet mask of the adapter "a0" is not settable.)", Without("Subnet Mask Setttable")),
      refused("-g 192.0.2.2", R"(SetIpv4Gateway("192.0.2.2"))",
              R"(The default gateway of the adapter "a0" is not settable.)",
              Without("Default Gateway Settable")),
      refused("-y 192.0.2.4", R"(SetDnsServers("", "192.0.2.4"))",
              R"(The primary DNS server of the adapter "a0" is not settable.)",
              Without("Primary DNS Settable")),
  };
  Check("ipconfig set", cases);
  // A change that went through before the test of DHCP takes effect.
  Harness changed(WithAnswers(dhcp.dump(), R"({"operation": "SetIpVersionEnabled", "status": 2})"));
  const Outcome refusal = changed("iscsi networkportal ipconfig set -A a0 -e true -i 192.0.2.7");
  EXPECT_TRUE(refusal.result.is_null());
  EXPECT_EQ(refusal.Calls().back(), "ResetAdapter");
}

TEST(IpconfigGet, SettlesTheName) {
  const json host = HostWith({{"useDhcpv4", true}, {"secondaryDns", "2001:db8::53"}});
  EXPECT_EQ(Harness(host.dump())("iscsi networkportal ipconfig get -A a0").result[0], json::parse(R"({
      "IscsiAdapter": "a0", "Hostnic": "p0", "IPv4Enabled": true, "IPv4": "192.0.2.9",
      "IPv4SubnetMask": "255.255.255.0",
      "IPv6": "fe80::9/64 2001:db8::1/64 2001:db8::2/64 2001:db8::3/64 ", "UseDhcpv4": true,
      "Gateway": "192.0.2.1", "PrimaryDNS": "192.0.2.53", "SecondaryDNS": "2001:db8::53"})"));

  // What GetLogicalNetworkPortals throws, if anything, decides with the kind of the adapter. The name is null
  // where the command fails.
  const std::string notSupported =
      "iScsiLibException: status(80000001): Not supported; Message= IMA_TSR_GetLnpOidList";
  const std::tuple<std::string, std::string, std::string, json> cases[] = {
      {"-n nosuch", "independent", "", "nosuch"},
      {"-n ''", "independent", "", ""},
      {"", "dependent", "", ""},
      {"-n p1", "independent", notSupported, "N/A"},
      {"", "independent", notSupported + "!", nullptr},
      {"", "dependent", notSupported, nullptr},
  };
  for (const auto& [options, kind, thrown, name] : cases) {
    json other = host;
    other["adapters"][0]["kind"] = kind;
    if (kind == "dependent") other["adapters"][0].erase("logicalPortals");
    if (!thrown.empty()) {
      other["answers"] = {
          {{"operation", "GetLogicalNetworkPortals"}, {"throw", "NodeCtlException"}, {"text", thrown}}};
    }
    const Outcome run = Harness(other.dump())("iscsi networkportal ipconfig get -A a0 " + options);
    EXPECT_EQ(run.messages.empty() ? run.result[0]["Hostnic"] : json(), name) << options << kind << thrown;
  }
}

TEST(Ipv6configSet, StepsMessagesAndStore) {
  constexpr char kFailed[] = "Failed to set IPv6 configuration on network portal.";
  const auto unsettable = [](const std::string& capability, const char* line, const char* message) {
    return Case{line, "GetCapabilities()", message, "{}", Without(capability + " Settable")};
  };
  const Case cases[] = {
      {"", "", "", "{}", Without("IPv6 Supported")},
      {"-g x", "GetCapabilities()", "IPv6 is not supported by adapter a0.", "{}", Without("IPv6 Supported")},
      unsettable("IPv6 Enable", "-e true -g ::1",
                 "Enabling/Disabling IPv6 is not supported by adapter a0. This parameter is not settable."),
      unsettable("IPv6 DHCP Configuration Method", "-d no",
                 "DHCPv6 configuration mode is not settable for adapter a0."),
      unsettable("IPv6 Linklocal Auto Configuration Method", "-l no",
                 "Link local auto configuration mode is not settable for adapter a0."),
      unsettable("IPv6 Router Advertisement Configuration Method", "-r no",
                 "Router Advertisemnet configuration mode is not supported by adapter a0."),
      {"-g ::1 -e false", "GetCapabilities(); SetIpVersionEnabled(6, false)",
       "IPv6 default gateway is not settable for adapter a0.", R"({"ipv6Enabled": false})",
       Without("IPv6 Default Gateway Settable")},
      {"-e false -d true -l true -r true -g 2001:DB8:0:0::1",
       R"(GetCapabilities(); SetIpVersionEnabled(6, false); SetIpv6ConfigMethod(2, true); )"
       R"(SetIpv6ConfigMethod(1, true); SetIpv6ConfigMethod(3, true); SetIpv6Gateway("2001:DB8:0:0::1"))",
       "",
       R"({"ipv6Enabled": false, "useDhcpv6": true, "useLinkLocalAutoConfiguration": true,
           "useRouterAdvertisement": true, "gateway6": "2001:db8::1"})"},
      {"-g ''", R"(GetCapabilities(); SetIpv6Gateway(""))", "", R"({"gateway6": "::"})",
       HostWith({{"gateway6", "2001:db8::9"}})},
      Refused("-g ff02::1", R"(GetCapabilities(); SetIpv6Gateway("ff02::1"))",
              R"("ff02::1" is not a unicast address.)", kFailed),
  };
  Check("ipv6config set", cases);
}

TEST(Ipv6configGet, ShowsWhatIsStated) {
  const char* line = "iscsi networkportal ipv6config get -A a0";
  EXPECT_EQ(
      Harness(HostWith({{"gateway6", "2001:db8::9"}, {"ipv6MaxStaticAddresses", 0}}).dump())(line).result,
      json::parse(R"({"IscsiAdapter": "a0", "IPv6 Supported": true, "IPv6 Enabled": true,
                "Gateway6": "2001:db8::9", "Use IPv6 Router Advertisement": false,
                "Use Link Local Auto Configuration": false, "Use Dhcpv6": false, "IPv6 Prefix Length Valid": false,
                "IPv6 Prefix Length": -1, "IPv6 Max Static Address Supported Valid": true,
                "IPv6 Max Static Address Supported": 0})"));
  EXPECT_EQ(Harness(Without("IPv6 Supported").dump())(line).result["IPv6 Supported"], false);
}

// Addresses

/// The addresses as they are stored.
std::string Stored(const std::vector<json>& addresses) {
  json stored = {{"ipv6Addresses", json::array()}};
  for (const json& one : addresses) {
    stored["ipv6Addresses"].push_back({{"address", one[0]}, {"prefixLength", one[1]}, {"type", one[2]}});
  }
  return stored.dump();
}

TEST(AddressCheck, RefusesBeforeAnythingChanges) {
  const std::string format =
      "Address (2001:db8::8/129) is not in valid format. Address must be in the format "
      "<ipv6-address>/<prefix-length>. Example: 1:2:3:4::/64.";
  const std::string autoConfigured =
      " link-local address as auto configuration of link-local address is enabled for adapter a0. You need "
      "to first disable link-local autoconfiguration.";
  const std::string advertised =
      " as router advertisement is enabled for adapter a0. You need to first disable router advertisement.";
  const std::string disabled =
      " IPv6 address as IPv6 is disabled for adapter a0. You need to first enable IPv6.";
  const struct {
    const char* network;
    const char* list;
    std::string add;
    std::string remove = add;
  } kCases[] = {
      {"{}", "-a 2001:db8::7/64 -a 2001:db8::8/129", format},
      {R"({"ipv6PrefixLength": 64})", "-a fe80::1/10",
       "Invalid prefix length (10). The adapter supports fixed prefix length (64)."},
      {R"({"useLinkLocalAutoConfiguration": true})", "-a 2001:db8::7/64 -a fe80::1/64",
       "Cannot add" + autoConfigured, "Cannot remove" + autoConfigured},
      {"{}", "-a fe80::1/64 -a 2001:db8::7/64 -a FEBF::1/64",
       "Multiple link-local addresses found. You should specify only one link-local address."},
      {R"({"useRouterAdvertisement": true})", "-a fe80::1/64 -a fec0::1/64",
       "Cannot add IPv6 address" + advertised, "Cannot remove IPv6 address" + advertised},
      {R"({"ipv6MaxStaticAddresses": 2})",
       "-a 2001:db8::7/64 -a fe80::1/64 -a 2001:db8::8/64 -a 2001:db8::8/64",
       "Trying to add more routable addresses than supported (2).",
       "Number of routable addresses (3)exceed maximum supported (2)"},
      {R"({"ipv6MaxStaticAddresses": 0})", "-a 2001:db8::7/64",
       "Trying to add more routable addresses than supported (0).",
       "Number of routable addresses (1)exceed maximum supported (0)"},
      {R"({"ipv6Enabled": false})", "-a x", "Cannot add/remove" + disabled, "Cannot remove" + disabled},
  };
  for (const auto& [network, list, add, remove] : kCases) {
    const json host = HostWith(json::parse(network));
    Check("ipv6config address add", {{list, kGet, add, "{}", host}});
    Check("ipv6config address remove", {{list, kGet, remove, "{}", host}});
  }
  const json none = Without("IPv6 Supported");
  constexpr char kNotSupported[] = "IPv6 not supported by adapter a0.";
  Check("ipv6config address remove", {{"-a x", kGet, kNotSupported, "{}", none}});
  const Case cases[] = {
      {"-a x", kGet, kNotSupported, "{}", none},
      {"", "",
       "No command option specified. Either --address-list or --remove-all-existing must be specified."},
      {"-r -a fe80::1/64", kGet, "Cannot remove existing IPv6 addresses" + advertised, "{}",
       HostWith({{"useRouterAdvertisement", true}})},
  };
  Check("ipv6config address add", cases);
}

TEST(AddressAdd, WalksAndStores) {
  constexpr char kFailed[] = "Error adding IPv6 address list on network portal";
  const json linkLocal = {"fe80::9", 64, 7};
  const std::string removed =
      R"(GetNetworkProperties(); SetIpv6Address("2001:db8::1", 64, false); SetIpv6Address("2001:db8::2", 64, false); )"
      R"(SetIpv6Address("2001:db8::3", 64, false))";
  const auto adding = [](const std::string& address) {
    return "GetNetworkProperties(); SetIpv6Address(" + address + ", true)";
  };
  const Case cases[] = {
      {"-r", removed, "", Stored({linkLocal})},
      {"-r=false -a 2001:DB8::5/48", removed + R"(; SetIpv6Address("2001:db8::5", 48, true))", "",
       Stored({linkLocal, {"2001:db8::5", 48, 0}}), HostWith({{"ipv6MaxStaticAddresses", 1}})},
      {"-a fe80::5/64", adding(R"("fe80::5", 64)"), "", Stored({json{"fe80::5", 64, 0}}),
       HostWith({{"useRouterAdvertisement", true}, {"ipv6Addresses", json::array()}})},
      // Refused by the adapter, with what was done by then kept.
      Refused("-a 2001:db8::5/64 -a 2001:db8::5/48 -a 2001:db8::6/64",
              adding(R"("2001:db8::5", 64)") + R"(; SetIpv6Address("2001:db8::5", 48, true))",
              R"(The adapter has the address "2001:db8::5" already.)", kFailed,
              HostWith({{"ipv6Addresses", json::array()}}), Stored({json{"2001:db8::5", 64, 0}})),
      Refused("-a 2001:db8::5/64", adding(R"("2001:db8::5", 64)"),
              "The adapter takes at most 1 static routable addresses.", kFailed,
              HostWith({{"ipv6MaxStaticAddresses", 1}})),
      Refused("-a fe80::5/64", adding(R"("fe80::5", 64)"),
              R"(The adapter has the link-local address "fe80::9" already, and takes only one.)", kFailed),
  };
  Check("ipv6config address add", cases);
}

TEST(AddressRemove, WalksAndStores) {
  const std::string kept = Stored({{"fe80::9", 64, 7}, {"2001:db8::2", 64, 9}, {"2001:db8::3", 64, 7}});
  const std::string first = R"(GetNetworkProperties(); SetIpv6Address("2001:db8::1", 64, false))";
  const auto refused = [&](const char* line, const std::string& call, const char* reason) {
    return Refused(line, first + "; " + call, reason, "Error removing IPv6 address on network portal.",
                   HostWith(), kept);
  };
  const Case cases[] = {
      {"-a 2001:db8::1/64", first, "", kept},
      refused("-a 2001:db8::1/64 -a 2001:db8::7/64 -a 2001:db8::2/64",
              R"(SetIpv6Address("2001:db8::7", 64, false))",
              R"(The adapter does not have the address "2001:db8::7".)"),
      refused("-a 2001:db8::1/64 -a 2001:db8::2/48", R"(SetIpv6Address("2001:db8::2", 48, false))",
              R"(The prefix of the address "2001:db8::2" has 64 bits, not 48.)"),
  };
  Check("ipv6config address remove", cases);
}

TEST(AddressList, ShowsEachWithItsType) {
  const char* line = "iscsi networkportal ipv6config address list -A a0";
  json host = HostWith({{"ipv6Enabled", false}});
  host["adapters"][0]["network"]["ipv6Addresses"].push_back(
      {{"address", "2001:DB8:0:0::4"}, {"prefixLength", 0}, {"type", 3}});
  const json rows = Harness(host.dump())(line).result;
  const char* types[] = {"AUTOCONF", "STATIC", "DHCP", "AUTOCONF", "UNKNOWN"};
  ASSERT_EQ(rows.size(), 5u);
  for (std::size_t i = 0; i < 5; ++i) EXPECT_EQ(rows[i]["Type"], types[i]);
  EXPECT_EQ(rows[4], json::parse(R"({"Address": "2001:db8::4", "IPv6PrefixLength": 0, "Type": "UNKNOWN"})"));
}

}  // namespace
