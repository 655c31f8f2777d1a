// The iSNS commands, which stand on no path.
#include "support/Harness.h"
#include "support/SweepTable.h"

namespace {

using nlohmann::json;

constexpr char kUnknownAdapter[] = "Invalid adapter specified or unable to get adapter.";

constexpr char kHost[] = R"({"adapters": [
    {"name": "a0", "capabilities": {"ISnS Settable": true}, "isns": {"current": 60, "min": 5, "max": 600},
     "isnsServers": [{"address": "192.0.2.1"}, {"method": "dhcp"}, {"method": "slp"},
                     {"address": "isns.example", "inherited": false, "parms": {"current": 20, "min": 2}}]},
    {"name": "a1", "isns": {"valid": false}},
    {"name": "a2", "isns": {"settable": false}}]})";

Outcome RunOn(Harness& host, const std::string& name, const std::string& options) {
  for (const sweep::SweptCommand& one : sweep::Commands()) {
    if (one.name == name) return host(name, one.make(), options);
  }
  throw std::logic_error(name);
}

/// "Unable to set ..." as the two commands write it, behind a bar.
std::string Unset(const std::string& name) {
  return "|Unable to set " + name +
         " parameters. Please make sure parameter input is settable and within MAX/MIN range (integer takes "
         "numbers, bool takes [true/false,yes/no,y/n]).";
}
constexpr char kGet[] = "|Failed to get iSNS parameter configuration.";

TEST(Isns, EachCommandTestsInItsOrder) {
  constexpr char kMethod[] = "Only static discovery method supported";
  constexpr char kAddress[] = "Address required for static discovery method";
  constexpr char kOnlyOne[] = "Only one options value, inherit, default can be used at once.";
  constexpr char kTogether[] = "The value and default options cannot be used together.";
  constexpr char kDefault[] = "Invalid default option use, it does not take false/no/n/0 value.";
  const std::string bad = "\"a b\" is not an IPv4 address, an IPv6 address or a host name.";
  const std::string none = "The adapter \"a0\" has no iSNS server \"192.0.2.9\".";
  const std::string server = "-A a0 -m static -a 192.0.2.1 ";
  const std::string unknown = "-A a0 -m static -a 192.0.2.9";
  constexpr char kAdd[] = "AdapterDiscoveryIsnsAdd";
  constexpr char kRemove[] = "AdapterDiscoveryIsnsRemove";
  constexpr char kShow[] = "AdapterDiscoveryIsnsParamGet";
  constexpr char kSet[] = "AdapterDiscoveryIsnsParamSet";
  constexpr char kSetAdapter[] = "AdapterIsnsParamSet";
  const std::string notAdded = "|Unable to add iSNS discovery address.";
  const std::string noAddress = "-A none -m static -a 'a b' ";
  const std::string noAdapter = "-A none -m static -a ::1 ";
  const struct {
    const char* name;
    std::string options;
    std::string messages;  ///< with a bar between
    const char* calls;     ///< behind the lookup of the adapter; null where there is not even that
  } kCases[] = {
      {kAdd, "-A none -m dhcp", kMethod, nullptr},
      {kAdd, "-A none -m static", kAddress, nullptr},
      {kAdd, noAddress, bad + notAdded, nullptr},
      {kAdd, noAdapter, kUnknownAdapter, ""},
      {kAdd, server, R"(The adapter "a0" has the iSNS server "192.0.2.1" already.)" + notAdded,
       "AddIsnsConfig "},
      {kAdd, "-A a1 -m static -a ::1", R"(The iSNS servers of the adapter "a1" are not settable.)" + notAdded,
       "AddIsnsConfig "},
      {kRemove, "-A none -m Static -a ''", kMethod, nullptr},
      {kRemove, noAddress, bad + "|Failed to remove iSNS discovery address..", nullptr},
      {kRemove, unknown, none + "|Unable to remove iSNS discovery address.", "RemoveIsnsConfig "},
      {kShow, "-A none -m slp", kMethod, nullptr},
      {kShow, noAddress, bad + kGet, nullptr},
      {kShow, unknown, none + kGet, "GetIsnsParms "},
      {kSet, "-A none -m dhcp -k ''", kOnlyOne, nullptr},
      {kSet, "-A none -m dhcp -k '' -v '' -I", kOnlyOne, nullptr},
      {kSet, "-A none -m dhcp -k '' -v ''", kMethod, nullptr},
      {kSet, "-A none -m static -k '' -D", kAddress, nullptr},
      {kSet, noAddress + "-k '' -D", bad + "|Unnable to set isns parameters.", nullptr},
      {kSet, noAdapter + "-k '' -v ''", "Invalid iscsi key input.", nullptr},
      {kSet, noAdapter + "-k x -v ''", "Invalid iscsi value input.", nullptr},
      {kSet, noAdapter + "-k x -v 1", kUnknownAdapter, ""},
      {kSet, server + "-k pollInterval -v 7", "Invalid parameter key" + Unset("isns"), "GetIsnsParms "},
      {kSet, server + "-k PollInterval -D=false", kDefault, "GetIsnsParms "},
      {kSet, server + "-k PollInterval -v 3601", "PollInterval 3601 is not from 1 to 3600." + Unset("isns"),
       "GetIsnsParms SetIsnsParms "},
      {kSetAdapter, "-A none -k ''", kTogether, nullptr},
      {kSetAdapter, "-A none -k '' -v 1 -D", kTogether, nullptr},
      {kSetAdapter, "-A none -k x -v 1", kUnknownAdapter, ""},
      {kSetAdapter, "-A a0 -k x -v 1", "Invalid parameter key" + Unset("iSNS"), "GetAdapterIsnsParms "},
      {kSetAdapter, "-A a2 -k PollInterval -D", "Parameter PollInterval is not settable.\n",
       "GetAdapterIsnsParms "},
      {kSetAdapter, "-A a0 -k PollInterval -D=no", kDefault, "GetAdapterIsnsParms "},
      {kSetAdapter, "-A a0 -k PollInterval -v 4", "PollInterval 4 is not from 5 to 600." + Unset("iSNS"),
       "GetAdapterIsnsParms SetAdapterIsnsParms "},
  };
  for (const auto& [name, options, messages, calls] : kCases) {
    SCOPED_TRACE(name + (" " + options));
    Harness host(kHost);
    const json before = host.Show();
    const Outcome run = RunOn(host, name, options);
    EXPECT_EQ(run.messages, sweep::Parts(messages));
    std::string made;
    for (const std::string& call : run.Calls()) made += call + ' ';
    EXPECT_EQ(made, calls == nullptr ? "" : std::string("GetScsiInterface ") + calls);
    EXPECT_TRUE(run.result.is_null() && !run.closed);
    EXPECT_EQ(host.Show(), before);
  }
}

json Servers(Harness& host, const std::string& options) {
  json shown = json::array();
  for (const json& row : RunOn(host, "AdapterDiscoveryIsnsList", options).result) {
    shown.push_back(row["Adapter"].get<std::string>() + " " + row["Method"].get<std::string>() + " " +
                    row["iSNS"].get<std::string>());
  }
  return shown;
}

TEST(Isns, ListAddRemove) {
  Harness host(kHost);
  EXPECT_EQ(Servers(host, "-A a0"),
            (json{"a0 static 192.0.2.1", "a0 dhcp ", "a0 slp ", "a0 static isns.example"}));
  EXPECT_EQ(Servers(host, "-A a1"), json::array());

  EXPECT_EQ(RunOn(host, "AdapterDiscoveryIsnsAdd", "-A a0 -m static -a 2001:DB8:0::7").result, true);
  EXPECT_EQ(RunOn(host, "AdapterDiscoveryIsnsRemove", "-A a0 -m static -a 192.0.2.1").result, true);
  EXPECT_EQ(RunOn(host, "AdapterDiscoveryIsnsRemove", "-A a0 -m static -a 2001:db8::0:7").result, true);
  EXPECT_EQ(Servers(host, ""), (json{"a0 dhcp ", "a0 slp ", "a0 static isns.example"}));
}

json ParmRow(const json& current, const json& standard, const json& min, const json& max,
             const json& settable, const json& inherit) {
  json row = {{"ID", nullptr}, {"Name", "PollInterval"}, {"Current", current}, {"Default", standard}};
  row.update({{"Min", min}, {"Max", max}, {"Settable", settable}, {"Inherit", inherit}});
  return json::array({row});
}

TEST(Isns, ParameterGoesFromDefaultToValueToInherited) {
  Harness host(kHost);
  const std::string server = "-A a0 -m static -a 192.0.2.1";
  const auto get = [&] { return RunOn(host, "AdapterDiscoveryIsnsParamGet", server).result; };
  const auto set = [&](const std::string& options) {
    return RunOn(host, "AdapterDiscoveryIsnsParamSet", server + " -k PollInterval " + options).result;
  };
  EXPECT_EQ(get(), ParmRow("60", "30", "1", "3600", true, true));
  EXPECT_EQ(RunOn(host, "AdapterDiscoveryIsnsParamGet", "-A a0 -m static -a isns.example").result,
            ParmRow("20", "30", "2", "3600", true, false));
  EXPECT_EQ(set("-v 45"), true);
  EXPECT_EQ(set("--inherit=false"), true);
  EXPECT_EQ(get(), ParmRow("45", "30", "1", "3600", true, false));
  EXPECT_EQ(set("-I"), true);
  EXPECT_EQ(set("-D"), true);
  EXPECT_EQ(get(), ParmRow("30", "30", "1", "3600", true, false));
  EXPECT_EQ(set("-I"), true);
  EXPECT_EQ(get()[0]["Current"], "60");

  const auto adapter = [&] { return RunOn(host, "AdapterIsnsParamGet", "-A a0").result; };
  EXPECT_EQ(adapter(), ParmRow("60", "30", "5", "600", true, false));
  EXPECT_EQ(RunOn(host, "AdapterIsnsParamSet", "-A a0 -k PollInterval -v 600abc").result, true);
  EXPECT_EQ(get()[0]["Current"], "600");
  EXPECT_EQ(RunOn(host, "AdapterIsnsParamSet", "-A a0 -k PollInterval -D").result, true);
  EXPECT_EQ(adapter()[0]["Current"], "30");
  EXPECT_EQ(RunOn(host, "AdapterIsnsParamGet", "-A a1").result,
            ParmRow(nullptr, nullptr, nullptr, nullptr, nullptr, nullptr));
  // Numbers are shown without a sign.
  Harness negative(R"({"adapters": [{"name": "a0", "isns": {"max": -1}}]})");
  EXPECT_EQ(RunOn(negative, "AdapterIsnsParamGet", "-A a0").result[0]["Max"], "4294967295");
}

}  // namespace
