// Session parameters and CHAP entries at the three levels: adapter, sendtarget and target portal.
#include <CoreCtl/Storage.h>

#include "support/Harness.h"
#include "support/Words.h"

namespace {

using nlohmann::json;
using testing::ElementsAre;
using testing::HasSubstr;
using Texts = std::vector<std::string>;

constexpr char kHost[] = R"({"adapters": [
  {"name": "hba0",
   "capabilities": {"CHAP Authorization Supported": true, "Mutual Authentication Supported": true,
                    "Target Level Authentication Supported": true,
                    "Target Level Mutual Authentication Supported": true,
                    "Adapter Header Digest Supported": true, "Adapter Data Digest Supported": true,
                    "Target Level Header Digest Supported": true, "Target Level Data Digest Supported": true,
                    "Delayed Ack Settable": true},
   "sendTargets": [{"host": "192.0.2.1"}],
   "staticTargets": [{"name": "iqn.2026-11.org.example:t", "host": "2001:db8::1", "port": 3261},
                     {"name": "iqn.2026-11.org.example:found", "host": "192.0.2.9",
                      "sendTarget": {"host": "192.0.2.1"}}]},
  {"name": "bare", "sendTargets": [{"host": "192.0.2.1"}],
   "staticTargets": [{"name": "iqn.2026-11.org.example:t", "host": "2001:db8::1", "port": 3261}]}]})";

constexpr char kFalseDefault[] = "Invalid default option use, it does not take false/no/n/0 value.";
constexpr char kParmFailure[] =
    "Unable to set parameters. Please make sure parameter input is settable and within MAX/MIN range "
    "(integer "
    "takes numbers, bool takes [true/false,yes/no,y/n]). Digests will take {prohibited, discouraged, "
    "preferred, required} only.";
constexpr char kBadLevel[] =
    "Invalid authentication level. Mutual CHAP can only be [prohibited] or [required].";
constexpr char kBadCombination[] =
    "Invalid CHAP and Mutual CHAP combination. If setting mutual CHAP, make sure CHAP is on "
    "[required] level.";

struct LevelCase {
  const char* path;
  const char* key;     ///< the options that name the place, the adapter aside
  const char* infix;   ///< in the names of its operations
  const char* record;  ///< where the host keeps it
  const char* chapSetFailure;

  bool Inherits() const { return *infix != '\0'; }
  std::string Command(const std::string& words, const std::string& adapter = "hba0") const {
    return std::string("iscsi adapter ") + path + words + " -A " + adapter + key;
  }
  std::string Operation(const std::string& verb, const std::string& what) const {
    const bool bare = *infix == '\0' && what == "Parms";
    return verb + (bare ? "Adapter" : infix) + what;
  }
  /// The calls of a command that sets a parameter.
  Texts ParmCalls(const Texts& stores) const {
    Texts calls = {"GetScsiInterface", "GetCapabilities", Operation("Get", "Parms")};
    for (const std::string& store : stores) calls.push_back(Operation("Set", store));
    return calls;
  }
  /// The calls of a CHAP command: the lookup and @p words, of which those for the record are made only where
  /// the level inherits.
  Texts ChapCalls(const std::string& words) const {
    Texts calls = {"GetScsiInterface"};
    for (const std::string& word : SplitWords(words)) {
      if (!Inherits() && word.ends_with("Parms")) continue;
      calls.push_back(Operation(word.substr(0, 3), word.substr(3)));
    }
    return calls;
  }
};

const LevelCase kLevels[] = {
    {"", "", "", "/adapters/0", "Failed to set iSCSI CHAP authentication configuration."},
    {"discovery sendtarget ", " -a 192.0.2.1", "SendTarget", "/adapters/0/sendTargets/0",
     "Failed to set CHAP authentication configuration."},
    {"target portal ", " -n iqn.2026-11.org.example:t -a [2001:db8::1]:3261", "Target",
     "/adapters/0/staticTargets/0", "Unable to set CHAP authentication."},
};

json RowOf(const Outcome& run, const std::string& key) {
  for (const json& row : run.result) {
    if (row["Name"] == key) return row;
  }
  return {};
}

TEST(ParamGet, AllMeansAllTargetsOnlyInBothPlaces) {
  Harness host(kHost);
  const Outcome all = host("iscsi adapter target portal param get -A hba0 -n all -a all");
  ASSERT_EQ(all.result.size(), 38u);
  EXPECT_EQ(all.result[37]["ID"], "iqn.2026-11.org.example:found,192.0.2.9:3260");
  EXPECT_EQ(all.Calls()[1], "GetStaticTargets");
  Harness none(R"({"adapters": [{"name": "hba0"}]})");
  for (const std::string command : {"param get", "auth chap get"}) {
    const std::string line = "iscsi adapter target portal " + command + " -A hba0";
    for (const char* options : {" -n all -a 192.0.2.9", " -n iqn.2026-11.org.example:t -a all"}) {
      const Outcome run = host(line + options);
      EXPECT_EQ(run.status, 1) << run.out;
      EXPECT_THAT(run.Calls(), testing::Not(testing::Contains("GetStaticTargets")));
    }
    EXPECT_EQ(none(line + " -n all -a all").result, json::array()) << command;
  }
}

TEST(ParamSet, EachKeyByValueByDefaultAndByInheritance) {
  for (const LevelCase& level : kLevels) {
    Harness host(kHost);
    const json rows = host(level.Command("param get")).result;
    ASSERT_EQ(rows.size(), 19u);
    for (const json& row : rows) {
      const std::string key = row["Name"];
      SCOPED_TRACE(level.Command(key));
      const bool isDigest = key.ends_with("Digest");
      const std::string value = isDigest                   ? "preferred"
                                : row["Min"] != "na"       ? row["Min"].get<std::string>()
                                : row["Current"] == "true" ? "no"
                                                           : "y";
      // A digest is stored by an operation of its own: first at the adapter, last below it.
      const Texts stores = !isDigest          ? Texts{"Parms"}
                           : level.Inherits() ? Texts{"Parms", key}
                                              : Texts{key, "Parms"};
      const Outcome set = host(level.Command("param set -k " + key + " -v " + value));
      EXPECT_EQ(set.result, true);
      EXPECT_EQ(set.Calls(), level.ParmCalls(stores));
      const json changed = RowOf(host(level.Command("param get")), key);
      EXPECT_EQ(changed["Current"], value == "no" ? "false" : value);
      EXPECT_EQ(changed["Inherit"], false);

      if (level.Inherits()) {
        const Outcome inherit = host(level.Command("param set --inherit -k " + key));
        EXPECT_EQ(inherit.result, true);
        EXPECT_EQ(inherit.Calls(), level.ParmCalls({"Parms"}));
        EXPECT_EQ(RowOf(host(level.Command("param get")), key), row);
      }
      const Outcome reset = host(level.Command("param set --default -k " + key));
      EXPECT_EQ(reset.result, true);
      EXPECT_EQ(reset.Calls(), level.ParmCalls(stores));
      json standard = row;
      standard["Inherit"] = false;
      EXPECT_EQ(RowOf(host(level.Command("param get")), key), standard);
    }
  }
}

TEST(ParamSet, WhatIsNotOverriddenFollowsTheParent) {
  Harness host(kHost);
  const std::string found =
      "iscsi adapter target portal param get -A hba0 -n iqn.2026-11.org.example:found -a 192.0.2.9";
  const auto current = [&](const std::string& command) {
    return RowOf(host(command), "LoginTimeout")["Current"].get<std::string>();
  };
  EXPECT_EQ(host(kLevels[0].Command("param set -k LoginTimeout -v 21")).result, true);
  EXPECT_EQ(current(kLevels[1].Command("param get")), "21");
  EXPECT_EQ(current(found), "21");
  EXPECT_EQ(host(kLevels[1].Command("param set -k LoginTimeout -v 22")).result, true);
  const std::string& call = host.trace.back();  // each value, or that it is inherited
  EXPECT_THAT(call, testing::StartsWith(
                        "SetSendTargetParms(hba0, \"192.0.2.1:3260\", {ErrorRecoveryLevel=inherited, "));
  EXPECT_THAT(call, HasSubstr(", LoginTimeout=22, LogoutTimeout=inherited, "));
  EXPECT_EQ(current(found), "22");  // by way of the sendtarget through which it was found
  EXPECT_EQ(current(kLevels[2].Command("param get")), "21");
  EXPECT_EQ(RowOf(host(found), "LoginTimeout")["Inherit"], true);
  host("iscsi adapter discovery sendtarget remove -A hba0 -a 192.0.2.1");
  EXPECT_EQ(current(found), "21");
}

TEST(ParamSet, WritesWhatDiffersFromWhatTheCallerWasGiven) {
  Harness host(kHost);
  const auto adapter = [] {
    return std::unique_ptr<NodeCtl::Storage::iScsiInterface>(dynamic_cast<NodeCtl::Storage::iScsiInterface*>(
        CoreCtl::Storage::StorageInfoImpl().GetScsiInterface("hba0")));
  };
  const auto expect = [&](int loginTimeout, int maxCmds) {
    const auto found = adapter()->GetAdapterParms();
    EXPECT_EQ(found.loginTimeout.current, loginTimeout);
    EXPECT_EQ(found.maxCmds.current, maxCmds);
  };
  const auto one = adapter();
  auto parms = one->GetAdapterParms();
  host(kLevels[0].Command("param set -k MaxCmds -v 64"));
  parms.loginTimeout.current = 21;
  one->SetAdapterParms(parms);
  expect(21, 64);
  parms.loginTimeout.current = 15;  // back to what was read, from what was stored
  one->SetAdapterParms(parms);
  expect(15, 64);
  adapter()->SetAdapterParms(parms);  // of one that was not read, all counts
  expect(15, 128);
}

TEST(ParamSet, OptionsAreTestedInOrder) {
  for (const LevelCase& level : kLevels) {
    const char* options = level.Inherits() ? "Only one options value, inherit, default can be used at once."
                                           : "The value and default options cannot be used together.";
    // The message, and whether it comes before the lookup of the adapter.
    const std::tuple<std::string, std::string, bool> cases[] = {
        {" -k LoginTimeout", options, true},
        {" -k '' -v '' --default=false", options, true},
        {" -k '' -v ''", "Invalid iscsi key input.", true},
        {" -k LoginTimeout -v ''", "Invalid iscsi value input.", true},
        {" -k LoginTimeout --default=false", kFalseDefault, false},
        {" -k logintimeout -v 1", kParmFailure, false},
        {" -k LoginTimeout -v 0", kParmFailure, false},
        {" -k HeaderDigest -v Required", kParmFailure, false},
    };
    for (const auto& [chosen, message, isBefore] : cases) {
      Harness host(kHost);
      const json before = host.Show(level.record);
      const Outcome run = host(level.Command("param set") + chosen);
      EXPECT_THAT(run.messages, ElementsAre(message)) << level.path << chosen;
      EXPECT_TRUE(run.result.is_null() && !run.closed);
      EXPECT_EQ(run.trace.empty(), isBefore) << chosen;
      // Below the adapter a word that is no digest is found out when the record has been stored.
      const bool stored = level.Inherits() && chosen.find("Digest") != std::string::npos;
      EXPECT_EQ(host.Show(level.record) == before, !stored) << chosen;
      EXPECT_THAT(run.Calls(), testing::Not(testing::Contains(level.Operation("Set", "HeaderDigest"))));
    }
  }
  Harness host(kHost);
  EXPECT_THAT(host(kLevels[0].Command("param set -k LoginTimeout -v 61")).trace.back(),
              HasSubstr("LoginTimeout cannot be set to 61: its range is from 1 to 60."));
  for (const char* pair : {" -v 1 -I", " -v 1 -D", " -I -D"}) {
    EXPECT_THAT(host(kLevels[1].Command("param set -k LoginTimeout") + pair).messages,
                ElementsAre("Only one options value, inherit, default can be used at once."));
  }
  const Outcome nothing = host(kLevels[2].Command("param set -k LoginTimeout --inherit=no"));
  EXPECT_EQ(nothing.result, true);
  EXPECT_EQ(nothing.Calls(), kLevels[2].ParmCalls({}));
  EXPECT_THAT(
      host("iscsi adapter discovery sendtarget param set -A hba0 -a [::1 -k LoginTimeout -v 1").messages,
      ElementsAre(kParmFailure));
}

TEST(ParamSet, NotSettableSaysSoWithItsNewline) {
  Harness host(R"({"adapters": [{"name": "hba0", "sendTargets": [{"host": "192.0.2.1"}],
      "capabilities": {"Adapter Header Digest Supported": true, "Target Level Data Digest Supported": true},
      "parameters": {"LoginTimeout": {"settable": false}, "MaxCmds": {"supported": false, "settable": false}}}]})");
  const struct {
    int level;
    std::string key;
    bool settable = false;
  } cases[] = {{0, "HeaderDigest", true}, {0, "DataDigest"},   {1, "HeaderDigest"}, {1, "DataDigest", true},
               {0, "LoginTimeout"},       {1, "LoginTimeout"}, {0, "MaxCmds"},      {0, "DelayedAck"}};
  for (const auto& [number, key, settable] : cases) {
    const LevelCase& level = kLevels[number];
    const Outcome run = host(level.Command("param set --default -k " + key));
    EXPECT_EQ(run.messages, settable ? Texts() : Texts{"Parameter " + key + " is not settable.\n"}) << key;
    EXPECT_EQ(run.Calls().size(), settable ? run.Calls().size() : 3u);
    EXPECT_EQ(RowOf(host(level.Command("param get")), key)["Settable"], settable) << key;
  }
  const json unsupported = RowOf(host(kLevels[0].Command("param get")), "MaxCmds");
  for (const char* field : {"Current", "Default", "Min", "Max"}) EXPECT_EQ(unsupported[field], "na");
}

// CHAP

json ChapRow(Harness& host, const LevelCase& level, const std::string& direction) {
  return host(level.Command("auth chap get -d " + direction)).result.at(0);
}

TEST(ChapSet, DirectionLevelAndTheCurrentUniLevel) {
  const std::string uni = " -N n -S secret-n -l ";
  const std::string mutual = " -d mutual" + uni;
  const json off = {"none", "none", "prohibited"};
  const json kept = {"m", "secret-m", "required"};
  constexpr char kStored[] = "GetParms SetParms SetChapParameters";
  constexpr char kCleared[] = "GetParms SetParms SetChapParameters SetChapParameters";
  constexpr char kChecked[] = "GetParms GetChapParameters SetParms SetChapParameters";
  const struct {
    const char* before;  ///< the level of the uni entry
    std::string options;
    json uniNow;  ///< null where it is as before
    json mutualNow;
    std::string calls;  ///< behind the lookup; those for the record only where the level inherits
    Texts messages = {};
  } cases[] = {
      {"required", " -D", off, off, kCleared},
      {"preferred", uni + "prohibited", off, off, kCleared},
      {"prohibited", uni + "discouraged", {"n", "secret-n", "discouraged"}, kept, kStored},
      {"required", uni + "preferred", {"n", "secret-n", "preferred"}, kept, kStored},
      {"discouraged", uni + "required", {"n", "secret-n", "required"}, kept, kStored},
      {"discouraged", " -d mutual -D", {}, off, kChecked},
      {"required", mutual + "prohibited", {}, off, kChecked},
      {"required", mutual + "required", {}, {"n", "secret-n", "required"}, kChecked},
      {"prohibited", mutual + "required", {}, kept, "GetParms GetChapParameters", {kBadCombination}},
      {"preferred", mutual + "required", {}, kept, "GetParms GetChapParameters", {kBadCombination}},
      {"required", mutual + "discouraged", {}, kept, "GetParms", {kBadLevel}},
      {"required", mutual + "preferred", {}, kept, "GetParms", {kBadLevel}},
  };
  for (const LevelCase& level : kLevels) {
    for (const auto& [before, options, uniNow, mutualNow, calls, messages] : cases) {
      SCOPED_TRACE(std::string(level.path) + before + options);
      json description = json::parse(kHost);
      description[json::json_pointer(std::string(level.record) + "/chap")] = {
          {"uni", {{"name", "u"}, {"secret", "secret-u"}, {"level", before}}},
          {"mutual", {{"name", "m"}, {"secret", "secret-m"}, {"level", "required"}}}};
      Harness host(description.dump());
      const Outcome run = host(level.Command("auth chap set" + options));
      EXPECT_EQ(run.messages, messages);
      EXPECT_EQ(run.result, messages.empty() ? json(true) : json());
      EXPECT_EQ(run.Calls(), level.ChapCalls(calls));
      const auto entry = [&](const char* direction) {
        const json stored = host.Show(std::string(level.record) + "/chap/" + direction);
        return json{stored["name"], stored["secret"], stored["level"]};
      };
      EXPECT_EQ(entry("uni"), uniNow.is_null() ? json({"u", "secret-u", before}) : uniNow);
      EXPECT_EQ(entry("mutual"), mutualNow);
    }
  }
}

TEST(ChapSet, InputIsTestedBehindTheAdapterAndAheadOfAnyStore) {
  constexpr char kInput[] =
      "Invalid CHAP authentication input. Make sure [--default] or [--authname --secret --level] is given.";
  const std::pair<const char*, const char*> cases[] = {
      {"", kInput},
      {" -N a -S b", kInput},
      {" -N a -l required", kInput},
      {" --default=false -N a -S b -l required", kFalseDefault},
  };
  for (const LevelCase& level : kLevels) {
    for (const auto& [options, message] : cases) {
      const Outcome run = Harness(kHost)(level.Command("auth chap set") + options);
      EXPECT_THAT(run.messages, ElementsAre(message)) << level.path << options;
      EXPECT_EQ(run.Calls().size(), level.Inherits() ? 2u : 1u) << options;
    }
  }
}

TEST(ChapSet, InheritSetsTheMarkOfTheDirectionAlone) {
  for (const LevelCase& level : kLevels) {
    if (!level.Inherits()) continue;
    Harness host(kHost);
    host(kLevels[0].Command("auth chap set -N top -S secret-top -l required"));
    host(kLevels[0].Command("auth chap set -d mutual -N top-m -S secret-m -l required"));
    EXPECT_EQ(ChapRow(host, level, "uni")["Name"], "top");
    host(level.Command("auth chap set -l prohibited"));
    EXPECT_EQ(ChapRow(host, level, "uni")["Inheritance"], false);
    // Its own entry is cleared, its mark stays.
    EXPECT_EQ(ChapRow(host, level, "mutual")["Inheritance"], true);
    EXPECT_EQ(ChapRow(host, level, "mutual")["Name"], "top-m");
    host(level.Command("auth chap set -d mutual -l prohibited"));
    const Outcome uni = host(level.Command("auth chap set --inherit --default=false -N a -S b -l preferred"));
    EXPECT_EQ(uni.result, true);
    EXPECT_EQ(uni.Calls(), level.ChapCalls("GetParms SetParms"));
    EXPECT_EQ(ChapRow(host, level, "uni")["Name"], "top");
    EXPECT_EQ(ChapRow(host, level, "mutual")["Inheritance"], false);
    EXPECT_EQ(host(level.Command("auth chap set --inherit -d mutual")).result, true);
    EXPECT_EQ(ChapRow(host, level, "mutual")["Name"], "top-m");
    EXPECT_EQ(host(level.Command("auth chap set --inherit=no")).messages.size(), 1u);
  }
}

TEST(ChapSet, ARefusedEntryLeavesTheInheritedOneInForce) {
  for (const LevelCase& level : kLevels) {
    for (const bool hasOld : {false, true}) {
      if (!level.Inherits()) continue;
      Harness host(kHost);
      host(kLevels[0].Command("auth chap set -N top -S secret-top -l required"));
      if (hasOld) {
        host(level.Command("auth chap set -l prohibited"));
        host(level.Command("auth chap set --inherit"));
      }
      EXPECT_EQ(host(level.Command("auth chap set -l required -N a -S '***'")).status, 1);
      const json row = ChapRow(host, level, "uni");
      EXPECT_EQ(json({row["Name"], row["Level"], row["Inheritance"]}), json({"top", "required", false}));
      EXPECT_EQ(host.Show(std::string(level.record) + "/chap/uni/secret"), "secret-top");
    }
  }
}

// The command clears the mutual entry itself, in a call of its own that a kill can keep from happening.
TEST(ChapSet, ProhibitedChapLeavesNoMutualChapBehind) {
  for (const LevelCase& level : kLevels) {
    Harness host(WithAnswers(kHost, "{\"operation\": \"" + level.Operation("Set", "ChapParameters") +
                                        "\", \"throw\": \"NodeCtlException\", \"call\": 4}"));
    host(level.Command("auth chap set -N u -S secret-u -l required"));
    host(level.Command("auth chap set -d mutual -N m -S secret-m -l required"));
    EXPECT_EQ(host(level.Command("auth chap set -l prohibited")).status, 1);
    EXPECT_EQ(ChapRow(host, level, "mutual")["Level"], "prohibited");
  }
}

TEST(ChapSet, WhatTheAdapterLacksIsRefusedWithoutTheSecret) {
  for (const LevelCase& level : kLevels) {
    Harness host(kHost);
    const std::string lacked = level.Inherits() ? "Target Level Authentication" : "CHAP Authorization";
    const std::tuple<const char*, std::string, std::string> cases[] = {
        {"bare", "hush-hush-hush",
         "CHAP cannot be required: the adapter lacks \"" + lacked + " Supported\"."},
        {"hba0", "hush\xff", "The CHAP secret is not UTF-8."},
        {"hba0", std::string("hush\0", 5), "The CHAP secret has a zero byte."},
        {"hba0", std::string(252, ' ') + "hush",
         "The CHAP secret has 256 bytes, and from 1 to 255 are allowed."},
        {"hba0", "***", "The CHAP secret is ***, which stands for a secret that is not shown."}};
    for (const auto& [adapter, secret, reason] : cases) {
      host.input = secret;
      const Outcome run = host(level.Command("auth chap set -N a -S - -l required", adapter));
      EXPECT_THAT(run.messages, ElementsAre(level.chapSetFailure));
      EXPECT_THAT(run.trace.back(), testing::EndsWith(reason));
      EXPECT_THAT(run.trace.back() + run.err, testing::Not(HasSubstr("hush")));
    }
    EXPECT_EQ(host(level.Command("auth chap set -l prohibited", "bare")).result, true);
    EXPECT_THAT(host(level.Command("auth chap set --authname= -S s -l required")).messages,
                ElementsAre(level.chapSetFailure));
  }
}

}  // namespace
