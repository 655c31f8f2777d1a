// Why commands fail, and what they leave to do: reasons with their codes, notes, and exit statuses.
#include <fstream>
#include <set>
#include <tuple>

#include "UnregisteredCommands.h"
#include "host/Storage.h"
#include "simulator/Commands.h"
#include "support/Harness.h"
#include "support/ProbeCommand.h"
#include "support/ProjectFile.h"
#include "support/SweepTable.h"

namespace {

using nlohmann::json;
using testing::HasSubstr;
using namespace TessaroCli::IscsiNamespace;
using Texts = std::vector<std::string>;

/// The host of the sweep, on which every adapter can do all, with @p keys merged into the adapter @p name.
std::string HostWith(const std::string& name, const std::string& keys) {
  json host = json::parse(sweep::HostDescription());
  for (json& adapter : host["adapters"]) {
    if (adapter["name"] == name) adapter.merge_patch(json::parse(keys));
  }
  return host.dump();
}

/// A command that the host refuses.
struct Refusal {
  std::string line;  ///< a bar in front of the refused line ends one that makes it so
  std::string code;
  std::string text;             ///< a part of the reason's
  std::string adapter = "{}";   ///< keys of the adapter "ind"
  NodePtr (*make)() = nullptr;  ///< of a command that stands on no path
};

template <class CommandClass>
NodePtr New() {
  return CommandClass::New();
}

std::string Lacks(const char* capability) { return json({{"capabilities", {{capability, false}}}}).dump(); }

const std::string kLong(256, 'x');
const std::string kFixed = " -A ind -n iqn.2026-11.org.example:fixed -a 192.0.2.41 ";

const Refusal kRefusals[] = {
    {"adapter get -A ind2", "not-found", "The host has no adapter \"ind2\"."},
    {"adapter get -A disk0", "invalid", "Not iSCSI adapter."},
    {"adapter set -A ind -n bad", "invalid", "\"bad\" is not a valid iSCSI name"},
    {"adapter set -A ind -a " + kLong, "out-of-range", "The alias has 256 bytes"},
    {"adapter set -A ind -a x", "not-settable", "are not settable", Lacks("Name And Alias Settable")},
    {"software set -e true -n bad", "invalid", "\"bad\" is not a valid iSCSI name"},

    {"adapter param set -A ind -k MaxBurstLength -v 1", "out-of-range", "its range is from 512 to 16777215."},
    {"adapter param set -A ind -k NoSuch -v 1", "invalid", "Invalid parameter key"},
    {"adapter param set -A ind -k InitialR2T -v perhaps", "invalid", "Invalid data type"},
    {"adapter param set -A ind -k DataDigest -v perhaps", "invalid", "Invalid digest"},
    {"adapter discovery sendtarget param set -A ind -a 192.0.2.99 -k MaxCmds -v 9", "not-found",
     "has no sendtarget 192.0.2.99:3260"},
    {"adapter auth chap set -A ind --authname u --secret '' --level required", "out-of-range",
     "The CHAP secret has 0 bytes"},
    {"adapter auth chap set -A ind --authname u --secret *** --level required", "invalid", "stands for"},
    {"adapter auth chap set -A ind --authname u --secret s3cr3t --level required", "not-supported",
     "lacks \"CHAP Authorization Supported\"", Lacks("CHAP Authorization Supported")},
    {"adapter target portal auth chap set" + kFixed + "--authname \xff --secret s --level required",
     "invalid", "The CHAP name"},

    {"adapter discovery sendtarget add -A ind -a 192.0.2.31", "exists", "already"},
    {"adapter discovery sendtarget add -A ind -a a:b:c", "invalid", "Invalid address"},
    {"adapter discovery sendtarget add -A ind -a a_b", "invalid", "is not an IPv4 address"},
    {"adapter discovery sendtarget add -A ind -a 192.0.2.9", "not-supported", "takes no",
     Lacks("Sendtarget Discovery Settable")},
    {"adapter discovery sendtarget remove -A ind -a 192.0.2.9", "not-found", "has no sendtarget"},
    {"adapter discovery rediscover -A ind | adapter discovery statictarget remove -A ind -a 192.0.2.31 "
     "-n iqn.2026-11.org.example:told",
     "wrong-state", "is no static target"},
    {"adapter discovery rediscover -A ind", "wrong-state", "is not online", R"({"state": 1})"},

    {"networkportal add -A ind -n nic2", "not-supported", "has ports of its own"},
    {"networkportal add -A soft -n nic9", "not-found", "no NIC \"nic9\""},
    {"networkportal add -A soft -n nic1", "exists", "is bound to the adapter \"soft\" already"},
    {"networkportal remove -A soft -n nic2", "not-found", "is not bound"},
    {"session add -A soft | networkportal remove -A soft -n nic1", "in-use", "Active sessions use"},
    {"networkportal ipconfig set -A ind -i 1.2.3", "invalid", "is not an IPv4 address"},
    {"networkportal ipconfig set -A ind -i 224.0.0.1", "invalid", "is not a unicast address"},
    {"networkportal ipconfig set -A ind -s 255.0.255.0", "invalid", "is not a subnet mask"},
    {"networkportal ipconfig set -A ind -g 198.51.100.1", "wrong-state", "is not in the subnet"},
    {"networkportal ipconfig set -A ind -g gate", "invalid", "\"gate\" is not an IPv4 address"},
    {"networkportal ipconfig set -A ind -x dns", "invalid", "is not an IP address"},
    {"networkportal ipconfig set -A ind -g 192.0.2.9", "not-settable", "is not settable",
     Lacks("Default Gateway Settable")},
    {"networkportal ipv6config address add -A ind -a 2001:db8:2::20/64", "exists", "has the address"},
    {"networkportal ipv6config address add -A ind -a fe80::9/64", "too-many", "takes only one"},
    {"networkportal ipv6config address remove -A ind -a 2001:db8:2::99/64", "not-found", "does not have"},
    {"physicalnetworkportal param set -A ind -o MTU -v 1", "out-of-range", "The MTU 1 is not from"},

    {"session add -A ind -n iqn.2026-11.org.example:mirror", "wrong-state", "is not online",
     R"({"state": 1})"},
    {"adapter discovery statictarget add -A dep -n iqn.2026-11.org.example:x -a 192.0.2.9 | session add -A "
     "dep",
     "no-answer", "failed with status 0x00020000: The adapter has no network portal"},
    {"session add -A ind -n iqn.2026-11.org.example:fixed", "no-answer", "0x00010000: Nothing answered."},
    {"session add -A ind -n iqn.2026-11.org.example:vault", "login-refused",
     "failed with status 0x0201: The initiator could not be successfully authenticated",
     R"({"chap": {"uni": {"secret": "s3cr3t-wrong"}}})"},
    {"session add -A ind", "login-refused", "2 other logins failed as well."},

    {"adapter firmware get -A ind -f /no/such/file", "not-found", "No such file or directory"},
    {"-A ind -m static -a 192.0.2.60", "exists", "has the iSNS server", "{}", New<AdapterDiscoveryIsnsAdd>},
    {"-A ind -m static -a 192.0.2.61", "not-settable", "are not settable", Lacks("ISnS Settable"),
     New<AdapterDiscoveryIsnsAdd>},
    {"-A ind -m static -a 192.0.2.61", "not-found", "has no iSNS server", "{}",
     New<AdapterDiscoveryIsnsRemove>},
    {"-A ind -k PollInterval -v -1", "out-of-range", "PollInterval -1 is not from", "{}",
     New<AdapterIsnsParamSet>},
    {"-A ind -s 198.51.100.0/24 -g 192.0.2.1 -n port0", "exists", "exists already", "{}", New<RouteAdd>},
    {"-A ind -s 198.51.100.9/24 -g 192.0.2.1 -n port0", "invalid", "is not the address of its network", "{}",
     New<RouteAdd>},
};

TEST(Reasons, EachRefusalOfTheHostHasItsCode) {
  for (const Refusal& refusal : kRefusals) {
    SCOPED_TRACE(refusal.line);
    Harness host(HostWith("ind", refusal.adapter));
    Outcome run;
    for (const std::string& line : sweep::Parts(refusal.line)) {
      run = refusal.make ? host(refusal.make(), line + " --exit-codes") : host("--exit-codes iscsi " + line);
    }
    EXPECT_EQ(run.reasons.size(), 1u) << run.err;
    if (run.reasons.empty()) continue;
    const Plinth::Reason& reason = run.reasons.front();
    EXPECT_EQ(reason.code, refusal.code) << reason.text;
    EXPECT_THAT(reason.text, HasSubstr(refusal.text));
    EXPECT_THAT(run.err, HasSubstr(reason.text));
    EXPECT_EQ(run.err.find("s3cr3t"), std::string::npos) << run.err;
    int status = 0;
    for (const auto& [code, exitStatus] : Plinth::kReasonCodes)
      status = code == reason.code ? exitStatus : status;
    EXPECT_EQ(run.status, status);
  }
}

TEST(Reasons, EachKindOfFailureHasACodeThatIsDocumented) {
  std::ifstream document(ProjectFile("docs/command-line.md"));
  const std::string text{std::istreambuf_iterator<char>(document), {}};
  std::set<std::string> known;
  for (const auto& [code, exitStatus] : Plinth::kReasonCodes) {
    known.insert(std::string(code));
    const std::string row = "| `" + std::string(code) + "` | " + std::to_string(exitStatus) + " |";
    EXPECT_NE(text.find(row), text.npos) << row;
  }
  for (int kind = 0; kind <= static_cast<int>(host::Error::Kind::NoAnswer); ++kind) {
    EXPECT_TRUE(known.contains(std::string(host::Error(host::Error::Kind{kind}, "").Code()))) << kind;
  }
}

TEST(Reasons, TellOfResetsAndOfWhatWaits) {
  const struct {
    std::string line;
    std::string adapter;
    Texts notes;
  } cases[] = {
      {"adapter set -A ind -a x", R"({"applies": {"identity": "reset"}})", {"ind was reset."}},
      {"adapter set -A ind -a x",
       R"({"applies": {"identity": "reboot"}})",
       {"A change of ind waits for the host to boot again."}},
      {"adapter set -A ind -a x", "{}", {}},
      // This command does not look at what the change asks for.
      {"adapter target portal param set" + kFixed + "-k MaxCmds -v 9",
       R"({"applies": {"parameters": "reset"}})",
       {"A change of ind waits for a reset of it."}},
      {"software set --enabled false",
       "{}",
       {"A change of the software initiator waits for the host to boot again."}},
      {"software set --enabled false | software set --enabled true -n iqn.2026-11.org.example:new",
       "{}",
       {"A change of soft waits for the host to boot again."}},
  };
  for (const auto& [line, adapter, notes] : cases) {
    SCOPED_TRACE(line);
    const TemporaryRoot root;
    Harness host(HostWith("ind", adapter));
    Outcome run;
    for (const std::string& one : sweep::Parts(line)) run = host("iscsi " + one + " --output json");
    EXPECT_EQ(run.notes, notes);
    EXPECT_EQ(json::parse(run.out).value("notes", Texts{}), notes);
    EXPECT_EQ(run.err.empty(), notes.empty());
  }
}

TEST(Pending, IsListedSettingBySetting) {
  Harness host(HostWith("ind", R"({"applies": {"parameters": "reset", "network": "reboot"}})"));
  host("iscsi software set --enabled false");
  host("iscsi adapter param set -A ind -k MaxCmds -v 9");  // resets at once
  host("iscsi networkportal ipconfig set -A ind -x 192.0.2.54");
  host("iscsi adapter target portal param set" + kFixed + "-k MaxCmds -v 7");
  json rows;
  for (const json& row : host(simulator::NewPending(), "").result) {
    rows.push_back(Texts{row["Adapter"], row["Setting"], row["From"], row["To"], row["Waits For"]});
    EXPECT_EQ(row["Place"].get<std::string>().empty(), row["Setting"] != "parameters/MaxCmds") << row;
  }
  EXPECT_EQ(rows, json({{"", "softwareIscsi/enabled", "true", "false", "reboot"},
                        {"ind", "network/primaryDns", "192.0.2.53", "192.0.2.54", "reboot"},
                        {"ind", "parameters/MaxCmds", "", "7", "reset"}}));
}

/// Fails as it is told to.
class Source final : public Plinth::ReasonSource {
 public:
  Source() : before_(Plinth::SetReasonSource(this)) {}
  ~Source() override { Plinth::SetReasonSource(before_); }
  void BeginRun() override { failure.reset(); }
  std::optional<Plinth::Reason> TakeFailure() override { return std::exchange(failure, std::nullopt); }
  Texts TakeNotes() override { return {"b was\nreset."}; }

  void Fail(const std::string& text) { failure = Plinth::Reason{"Read", "", "busy", text}; }

  std::optional<Plinth::Reason> failure;

 private:
  Plinth::ReasonSource* before_;
};

TEST(Reasons, AreWhatFailedLastAheadOfEachReport) {
  Source source;
  source.Fail("It was before the run.");
  boost::shared_ptr<Plinth::Test::ProbeCommand> probe(new Plinth::Test::ProbeCommand);
  probe->prototype = Plinth::MetaObj::MetaBool::New();
  probe->body = [&](const Plinth::CallSpec::Input&, Plinth::CallSpec::Output& output) {
    output.ReportError("Nothing failed.");
    source.Fail("The command got over this.");
    source.Fail("The file\x1b is locked.");
    output.ReportError("No file.");
    output.ReportError("No text.");
    source.Fail("Told.");
    output.ReportError("Because: Told.");
    Plinth::Test::Post(output, Plinth::MetaObj::MetaBool::New(true));
    source.Fail("Without a report.");
  };
  const auto run = [&](const std::string& option) {
    Plinth::TextConsole console;
    const int status = Plinth::RunCommand(*probe, {"--output", "json", option}, console).status;
    EXPECT_EQ(json::parse(console.out.text)["status"], status);
    return std::tuple(status, console.out.text, console.error.text);
  };
  const auto [status, out, err] = run("--exit-codes=no");
  EXPECT_EQ(status, Plinth::kResultAndReported);
  EXPECT_EQ(err,
            "Nothing failed.\nNo file.\nNo text.\nBecause: Told.\n"
            "hcli: reason: The file\\x1b is locked.\nhcli: note: b was\\nreset.\n");
  const json document = json::parse(out);
  EXPECT_EQ(document["reasons"], json::parse(R"([
      {"operation": "Read", "adapter": null, "code": "busy", "text": "The file\u001b is locked."},
      {"operation": "Read", "adapter": null, "code": "busy", "text": "Told."}])"));
  EXPECT_EQ(document["messages"].size(), 4u);
  EXPECT_EQ(std::get<0>(run("--exit-codes")), 20);
  setenv("HCLI_EXIT_CODES", "yes", 1);
  EXPECT_EQ(std::get<0>(run("--trace=no")), 20);
  EXPECT_EQ(std::get<0>(run("--exit-codes=no")), Plinth::kResultAndReported);
  unsetenv("HCLI_EXIT_CODES");

  probe->body = [&](const Plinth::CallSpec::Input&, Plinth::CallSpec::Output&) {
    source.Fail("It escaped.");
    throw std::runtime_error("It escaped.");
  };
  const auto [failed, document2, told] = run("--trace=no");
  EXPECT_EQ(failed, Plinth::kFailure);
  EXPECT_EQ(told, "hcli: It escaped.\nhcli: note: b was\\nreset.\n");
  EXPECT_EQ(json::parse(document2)["reasons"].size(), 1u);
}

}  // namespace
