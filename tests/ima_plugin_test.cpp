// iscsi plugin list: all plug-ins, one of a name, or the one behind an adapter; and what stays of a failure.
#include "support/Harness.h"

namespace {

using testing::ElementsAre;

constexpr char kNoMatch[] = "Unable to find matching plugin.";

constexpr char kHost[] = R"({
  "plugins": [
    {"fileName": "liba.so", "vendor": "Zoë \u20ac"},
    {"fileName": "libb.so", "vendor": "first"},
    {"fileName": "libb.so", "vendor": "second"}],
  "adapters": [{"name": "hba0"}, {"name": "hba1", "plugin": "libb.so"}, {"name": "hba2", "plugin": "libc.so"}]})";

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
    EXPECT_EQ(run.Column("Vendor"), vendors) << options;
    EXPECT_EQ(run.messages, messages) << options;
    EXPECT_EQ(run.status, messages.empty() ? 0 : 3) << options;
  }
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
