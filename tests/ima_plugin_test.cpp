// iscsi plugin list: all plug-ins, one of a name, or the one behind an adapter; and what stays of a failure.
#include "support/Harness.h"

namespace {

using testing::ElementsAre;

constexpr char kNoMatch[] = "Unable to find matching plugin.";

constexpr char kHost[] = R"({
  "plugins": [
    {"fileName": "liba.so", "vendor": "Zoë \u20ac", "implementationVersion": "1.2", "supportedImaVersion": 4294967295,
     "buildTime": "2026-01-02 03:04:05", "lhbasCanBeCreatedAndDestroyed": 1, "autoPersistenceSupported": 2},
    {"fileName": "libb.so", "vendor": "first"},
    {"fileName": "libb.so", "vendor": "second"}],
  "adapters": [{"name": "hba0"}, {"name": "hba1", "plugin": "libb.so"}, {"name": "hba2", "plugin": "libc.so"}]})";

std::vector<std::string> Vendors(const nlohmann::json& list) {
  std::vector<std::string> vendors;
  for (const auto& row : list) vendors.push_back(row["Vendor"].get<std::string>());
  return vendors;
}

TEST(PluginList, SelectsAndNeverPostsNothing) {
  const std::string vendor = "Zo\xeb \xac";  // one byte for each character
  const std::tuple<std::string, std::vector<std::string>, std::vector<std::string>> cases[] = {
      {"", {vendor, "first", "second"}, {}},
      {"-p libb.so", {"first"}, {}},
      {"-p LIBB.SO", {}, {kNoMatch}},
      {"-p ''", {}, {kNoMatch}},
      {"-A hba0", {vendor}, {}},
      {"-A hba1", {"first"}, {}},
      {"-A hba2", {}, {"Unable to get plugin identifier."}},
  };
  Harness host(kHost);
  for (const auto& [options, vendors, messages] : cases) {
    const Outcome run = host("iscsi plugin list " + options);
    EXPECT_EQ(Vendors(run.result), vendors) << options;
    EXPECT_EQ(run.messages, messages) << options;
    EXPECT_EQ(run.status, messages.empty() ? 0 : 3) << options;
  }
  nlohmann::json first = host("iscsi plugin list").result[0];
  first.erase("Vendor");
  EXPECT_EQ(first,
            nlohmann::json::parse(R"({"Supported Ima Version": 4294967295, "Implementation Version": "1.2",
      "File Name": "liba.so", "Build Time": "na", "Auto Persistence Supported": false,
      "Lhbas Can Be Created And Destroyed": true})"));
  EXPECT_THAT(host("iscsi plugin list -p libb.so").Calls(),
              ElementsAre("IMA_GetPluginOidList", "IMA_GetPluginProperties", "IMA_GetPluginProperties"));

  const Outcome both = host("iscsi plugin list -p liba.so -A hba0");
  EXPECT_THAT(both.messages, ElementsAre("adapter and plugin options are mutually exclusive."));
  EXPECT_TRUE(both.result.is_null() && both.trace.empty());
  EXPECT_THAT(Harness("{}")("iscsi plugin list").messages, ElementsAre(kNoMatch));
}

TEST(PluginList, FailureLeavesTheRowsBeforeIt) {
  Harness host(WithAnswers(kHost, R"({"operation": "IMA_GetPluginProperties", "call": 3, "imaStatus": 1})"));
  const Outcome run = host("iscsi plugin list");
  EXPECT_THAT(run.messages, ElementsAre("Unable to get plugin properties."));
  EXPECT_EQ(run.result.size(), 2u);
}

}  // namespace
