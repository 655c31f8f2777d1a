#include <gtest/gtest.h>
#include <locale.h>
#include <unistd.h>

#include <nlohmann/json.hpp>
#include <stdexcept>

#include "plinth/Candidates.h"
#include "plinth/Guide.h"
#include "support/ProbeCommand.h"

namespace Plinth::Test {
namespace {

using CallSpec::Input;
using CallSpec::Output;
using CallSpec::ParameterType;
using namespace MetaObj;
using Arguments = std::vector<std::string>;

boost::shared_ptr<MetaStruct> PortShape() {
  auto shape = MetaStruct::New("Port");
  shape->SetField("Name", MetaString::New());
  shape->SetField("MTU", MetaInt::New());
  shape->SetField("Link Up", MetaBool::New());
  return shape;
}

boost::shared_ptr<MetaStruct> Port(const std::string& name, long long mtu, bool up) {
  auto port = PortShape();
  port->SetField("Name", name);
  port->SetField("MTU", mtu);
  port->SetField("Link Up", up);
  return port;
}

boost::shared_ptr<MetaList> Ports(const std::vector<boost::shared_ptr<MetaObject>>& rows) {
  auto list = MetaList::New(MetaType::Struct, PortShape());
  for (const auto& row : rows) list->Append(row);
  return list;
}

std::string Document(int status, const std::string& messages, const std::string& result) {
  return "{\"schema\": 1, \"status\": " + std::to_string(status) + ", \"messages\": [" + messages +
         "], \"result\": " + result + "}\n";
}

TEST(PlinthFormatters, ShowTheSameValuesInTheirForms) {
  ASSERT_TRUE(setlocale(LC_CTYPE, "C.UTF-8"));
  const std::string name = "n\xc3\xa4m\xe2\x82\xac \xe6\xbc\xa2";
  const auto probe = NewProbe(Ports(
      {Port(name, 1500, true), PortShape(), Port("a\nb\t\x1b\xff\"\\", -9223372036854775807LL, false)}));
  probe->SetDefaultOutputParameter("fields:Port", "MTU,Name");
  probe->SetDefaultOutputParameter("header:Port", "%Name% %Nope%: 100%");
  const std::string marks = R"(a\nb\t\x1b\xff"\)";
  const std::string header = " %Nope%: 100%\n   MTU: ";
  ExpectLines(*probe,
              {{{},
                name + header + "1500\n   Name: " + name + "\n\n" + header + "\n   Name: \n\n" + marks +
                    header + "-9223372036854775807\n   Name: " + marks + '\n'},
               {{"--output=table"},
                "                 MTU  Name\n--------------------  ----------------\n                1500  " +
                    name + "\n\n-9223372036854775807  " + marks + '\n'},
               {{"--output=csv"},
                "Name,MTU,Link Up\r\n" + name +
                    ",1500,true\r\n,,\r\n\"a\nb\t\\x1b\\xff\"\"\\\",-9223372036854775807,false\r\n"},
               {{"--output=csv", "--no-header", "--fields=Name"},
                name + "\r\n\"\"\r\n\"a\nb\t\\x1b\\xff\"\"\\\"\r\n"},
               {{"--output", "json"},
                Document(0, "",
                         R"([{"Name": ")" + name +
                             R"(", "MTU": 1500, "Link Up": true}, )"
                             R"({"Name": null, "MTU": null, "Link Up": null}, {"Name": "a\nb\t\u001b)"
                             "\xef\xbf\xbd"
                             R"(\"\\", "MTU": -9223372036854775807, "Link Up": false}])")}});
  ExpectLines(*NewProbe(MetaInt::New(-5)), {{{}, "-5\n"}});
  ExpectLines(*NewProbe(MetaString::New("two\nlines\x1b")), {{{}, "two\nlines\\x1b\n"}});
  ExpectLines(*NewProbe(Port("p", 1, true)),
              {{{}, "   Name: p\n   MTU: 1\n   Link Up: true\n"},
               {{"--output=table"}, "Name  MTU  Link Up\n----  ---  -------\np       1  true\n"},
               {{"--output=table", "--no-header"}, "p  1  true\n"}});
}

TEST(PlinthFormatters, FitTablesToTheTerminal) {
  ASSERT_TRUE(setlocale(LC_CTYPE, "C.UTF-8"));
  const std::string kanji = "\xe6\xbc\xa2";
  const auto probe = NewProbe(Ports({Port("iqn.2026-11.org.example:disk", 1234567890123, true),
                                     Port(kanji + kanji + kanji + kanji + kanji, 1, true)}));
  const struct {
    std::size_t columns;
    std::string first;
    std::string second;
  } cases[] = {
      {0, "iqn.2026-11.org.example:disk", kanji + kanji + kanji + kanji + kanji + std::string(18, ' ')},
      {49, "iqn.2026-11.org.example:disk", kanji + kanji + kanji + kanji + kanji + std::string(18, ' ')},
      {37, "iqn.2026\xe2\x80\xa6le:disk", kanji + kanji + kanji + kanji + kanji + std::string(6, ' ')},
      {29, "iqn.\xe2\x80\xa6isk", kanji + kanji + "\xe2\x80\xa6" + kanji + ' '},
      {24, "i\xe2\x80\xa6k", "\xe2\x80\xa6  "},
      {22, "iqn.2026-11.org.example:disk", kanji + kanji + kanji + kanji + kanji + std::string(18, ' ')},
  };
  for (const auto& one : cases) {
    TextConsole console;
    console.screen = {one.columns, 0};
    RunCommand(*probe, {"--output=table", "--no-header"}, console);
    EXPECT_EQ(console.out.text,
              one.first + "  1234567890123  true\n" + one.second + "              1  true\n");
  }
  TextConsole console;
  console.screen = {18, 0};
  RunCommand(*NewProbe(Ports({Port("16777215", 1, true)})), {"--output=table", "--color=never"}, console);
  EXPECT_EQ(console.out.text,
            "Name      MTU  L\xe2\x80\xa6p\n--------  ---  ---\n16777215    1  t\xe2\x80\xa6"
            "e\n");
}

const std::string kHelpEnd =
    " 0 a result, nothing reported; 1 something reported, no result; 2 a\n"
    "wrong command line, nothing run; 3 a result, and something reported; 4 a failure\nof the program.\n\n"
    "\"hcli --help\" lists the global options.\n";

TEST(PlinthFormatters, ColourHeadingsAndFailures) {
  const auto probe = NewProbe(Port("p", 1, true));
  probe->SetDefaultOutputParameter("header:Port", "%Name%");
  const std::string colours = "--color=always";
  ExpectLines(*probe, {{{colours, "--fields=MTU"}, "\x1b[1mp\x1b[0m\n   MTU: 1\n"},
                       {{colours, "--fields=MTU", "--output=table"}, "\x1b[1mMTU\n\x1b[0m---\n  1\n"},
                       {{colours, "--fields=MTU", "--output=csv"}, "MTU\r\n1\r\n"},
                       {{colours, "--output=json", "--version"}, Document(0, "", R"("hcli 0.1.0\n")")}});
  ExpectLines(
      *NewProbe(MetaBool::New(true)),
      {{{colours, "--help"},
        "\x1b[1mUsage:\x1b[0m hcli\n\n\x1b[1mResult:\x1b[0m bool\n\n\x1b[1mExit status:\x1b[0m" + kHelpEnd}});
  TextConsole console;
  RunCommand(*probe, {colours, "--nope"}, console);
  EXPECT_EQ(console.error.text, "\x1b[31mhcli: unknown option \"--nope\"; --help lists the options\n\x1b[0m");
}

TEST(PlinthFormatters, ReadTextsWhereTypesAreWanted) {
  const std::pair<const char*, const char*> cases[] = {
      {"0", "0"},
      {"-65536", "-65536"},
      {"4294967295", "4294967295"},
      {"12345678901", R"("12345678901")"},
      {"007", R"("007")"},
      {"-0", R"("-0")"},
      {"-", R"("-")"},
      {"1.5", R"("1.5")"},
      {"true", "true"},
      {"false", "false"},
      {"True", R"("True")"},
      {"a ", R"(["a"])"},
      {"1 true ", R"(["1", "true"])"},
      {"a b", R"("a b")"},
      {"a  b ", R"("a  b ")"},
      {" ", R"(" ")"},
      {"", R"("")"},
  };
  for (const auto& [text, read] : cases) {
    ExpectLines(*NewProbe(Ports({Port(text, 5, false), PortShape()})),
                {{{"--typed", "--output=json"},
                  Document(0, "",
                           std::string(R"([{"Name": )") + read +
                               R"(, "MTU": 5, "Link Up": false}, )"
                               R"({"Name": null, "MTU": null, "Link Up": null}])")}});
  }
  ExpectLines(
      *NewProbe(MetaString::New("7")),
      {{{"--typed", "--output=json"}, Document(0, "", "\"7\"")},
       {{"--typed=no"}, "7\n"},
       {{"--typed", "--output=csv"},
        "hcli: option --typed: it goes with --output json or --output yaml; other forms have texts alone\n",
        kUsage}});
}

TEST(PlinthRun, EndsWithoutAResultAndTellsWhy) {
  const struct {
    ProbeCommand::Body body;
    int status;
    const char* messages;
    const char* error;
  } cases[] = {
      {[](const Input&, Output& output) {
         output.ReportError("No.");
         output.ReportError("Line\n");
       },
       kReported, "\"No.\", \"Line\\n\"", "No.\nLine\n"},
      {[](const Input&, Output&) {}, kFailure, "\"the command ended with neither a result nor a report\"",
       "hcli: the command ended with neither a result nor a report\n"},
      {[](const Input&, Output& output) {
         output.ReportError("First");
         Post(output, MetaBool::New(true));
         throw std::runtime_error("bad\nluck");
       },
       kFailure, "\"First\", \"bad\\\\nluck\"", "First\nhcli: bad\\nluck\n"},
      {[](const Input&, Output&) { throw 42; }, kFailure, "\"an exception of type int\"",
       "hcli: an exception of type int\n"},
  };
  const auto probe = NewProbe(MetaBool::New());
  for (const auto& one : cases) {
    probe->body = one.body;
    ExpectLines(*probe, {{{}, one.error, one.status}});
    TextConsole json;
    EXPECT_EQ(RunCommand(*probe, {"--output=json"}, json).status, one.status);
    EXPECT_EQ(json.out.text, Document(one.status, one.messages, "null"));
    EXPECT_EQ(json.error.text, one.error);
  }
}

/// A tree with the framework's own commands and "net port list".
boost::shared_ptr<AutoCli::Namespace> NewTree() {
  auto root = AutoCli::Namespace::New();
  const auto net = AutoCli::Namespace::New();
  const auto port = AutoCli::Namespace::New();
  const auto list = NewProbe(Ports({Port("p0", 9000, true)}));
  list->SetDescription("List ports.");
  list->SetDefaultOutputFormatter("table");
  list->SetDefaultOutputParameter("fields:Port", "MTU");
  list->SetDefaultOutputParameter("fields:Port", "Name");
  list->parameters = {
      {"way", ParameterType::String, "w", "Way. %ENUM%", true, false, {{"in", "inwards"}, {"out", ""}}},
      {"mode", ParameterType::Flag, "", "", false, true, {}}};
  port->RegisterNamespaceNode(list, "list");
  net->SetDescription("Networks");
  net->RegisterNamespaceNode(port, "port");
  root->RegisterNamespaceNode(net, "net");
  RegisterOwnCommands(*root);
  return root;
}

TEST(PlinthRun, ResolvesWordsOrTellsWhatIsThere) {
  ExpectLines(
      *NewTree(),
      {
          {{"net", "port", "list", "-win"}, "Name\n----\np0\n"},
          {{"net", "--output=simple", "port", "list", "--way", "in"}, "   Name: p0\n"},
          {{"--", "net", "port", "list", "-win"},
           "hcli: unexpected argument \"-win\"; give values behind their options\n",
           kUsage},
          {{"net", ""}, "hcli: unknown command \"\" in \"net\"; there are: port\n", kUsage},
          {{"net", "port", "list", "-win", "--fields=Name,Speed"},
           "hcli: option --fields: there is no field \"Speed\"; there are: Name,MTU,Link Up\n",
           kUsage},
          {{"net", "port", "list", "-win", "--fields=MTU,MTU"},
           "hcli: option --fields: \"MTU\" is named twice\n",
           kUsage},
          {{"net", "--way", "in"}, "hcli: unknown option \"--way\"; --help lists the options\n", kUsage},
          {{"--version"}, "hcli 0.1.0\n"},
          {{"-h", "net"}, "Usage: hcli net COMMAND... [OPTIONS]\n\nNetworks\n\nCommands:\n  port\n"},
          {{"net", "port", "list", "--help"},
           "Usage: hcli net port list --way TEXT [OPTIONS]\n\nList ports.\n\nOptions:\n"
           "  -w, --way TEXT (required)\n          Way. [in, out]\n          in: inwards\n"
           "      --mode\n          \"-\" reads it from standard input, without echo.\n\n"
           "Result: list with the fields\n  Name     string\n  MTU      int\n  Link Up  bool\n\nExit "
           "status:" +
               kHelpEnd},
      });
}

TEST(PlinthRun, ProposesTheNearestOfSeveralNearWords) {
  const auto root = AutoCli::Namespace::New();
  for (const char* name : {"connects", "connections", "connector"}) {
    root->RegisterNamespaceNode(AutoCli::Namespace::New(), name);
  }
  ExpectLines(
      *root,
      {{{"connectons"}, "hcli: unknown command \"connectons\"; did you mean \"connections\"?\n", kUsage}});
}

TEST(PlinthRun, GivesOneDocumentHoweverItEnds) {
  const auto root = NewTree();
  const std::pair<Arguments, int> cases[] = {
      {{"--output=json", "--version"}, kSuccess},
      {{"net", "port", "list", "--help", "--output", "json"}, kSuccess},
      {{"--nope", "--output=json"}, kUsage},
      {{"--output", "nope", "--output", "json"}, kUsage},
      {{"net", "port", "list", "--output", "json", "--way", "\xff"}, kUsage},
      {{"net", "part", "list", "--way", "in", "--output", "json"}, kUsage},
      {{"completion", "ksh", "--output=json"}, kUsage},
  };
  for (const auto& [arguments, status] : cases) {
    TextConsole console;
    RunCommandLine(*root, arguments, console);
    const auto document = nlohmann::json::parse(console.out.text);
    EXPECT_EQ(document.size(), 4U);
    EXPECT_EQ(document.at("schema"), 1);
    EXPECT_EQ(document.at("status"), status) << console.out.text;
    EXPECT_EQ(document.at("result").is_null(), status == kUsage);
    std::string messages;
    for (const std::string message : document.at("messages")) messages += "hcli: " + message + '\n';
    EXPECT_EQ(messages, console.error.text);
    EXPECT_EQ(messages.empty(), status == kSuccess);
  }
}

TEST(PlinthCompletion, TakesValuesOfAHostThatAnswersInTime) {
  const auto good = Ports({Port("p0", 9000, true), Port("p0", 1500, true), Port("a\nb", 1, true), PortShape(),
                           Port("p 1", 1500, true)});
  const struct {
    const char* type;
    ProbeCommand::Body body;
    std::vector<std::string> values;
  } cases[] = {
      {"fetcher",
       [&](const Input&, Output& output) {
         fputs("noise", stderr);
         output.ReportError("some are missing");
         Post(output, good);
       },
       {"p0 9000", "p 1 1500"}},
      {"operation", [&](const Input&, Output& output) { Post(output, good); }, {}},
      {"fetcher", [](const Input&, Output&) { pause(); }, {}},
      {"fetcher", [](const Input&, Output&) { abort(); }, {}},
      {"fetcher", [](const Input&, Output&) { throw 42; }, {}},
  };
  for (const auto& one : cases) {
    const auto probe = NewProbe(good);
    probe->body = one.body;
    probe->SetMetaDataField("type", one.type);
    const auto root = AutoCli::Namespace::New();
    root->RegisterNamespaceNode(probe, "ports");
    testing::internal::CaptureStderr();
    std::vector<std::string> values;
    // On a crowded machine, a good host may need another chance.
    for (int tries = 0; tries < 5 && values != one.values; ++tries) {
      values.clear();
      for (const Candidate& value : ShownValues(
               *root, {},
               {.option = "", .of = "", .from = "ports", .field = "Name", .about = "MTU", .with = {}})) {
        values.push_back(value.word + ' ' + value.description);
      }
    }
    EXPECT_EQ(values, one.values);
    EXPECT_EQ(testing::internal::GetCapturedStderr(), "");
  }
}

TEST(PlinthCheck, TellsWhereAResultDiffers) {
  auto renamed = MetaStruct::New("Port");
  renamed->SetField("Title", "");
  auto mistyped = Port("p", 1, true);
  mistyped->SetField("MTU", "1");
  auto longer = Port("p", 1, true);
  longer->SetField("More", 1);
  auto shorter = MetaStruct::New("Port");
  shorter->SetField("Name", "p");
  const auto list = Ports({});
  const struct {
    boost::shared_ptr<MetaObject> declared;
    boost::shared_ptr<MetaObject> posted;
    const char* difference;
  } cases[] = {
      {list, Ports({Port("p", 1, true), PortShape()}), ""},
      {MetaStruct::New("Port"), longer, ""},
      {nullptr, MetaBool::New(true), "the command declares no result type"},
      {MetaBool::New(), list, "the result is list, declared is bool"},
      {list, MetaList::New(MetaType::Int, MetaInt::New()),
       "the result is a list of int, declared is a list of struct"},
      {list, Ports({MetaInt::New(1)}), "the result[0] is int, declared is struct"},
      {list, Ports({PortShape(), renamed}), "the result[1]: field 1 is \"Title\", declared is \"Name\""},
      {list, Ports({mistyped}), "the result[0].MTU is string, declared is int"},
      {list, Ports({longer}), "the result[0]: field \"More\" is not declared"},
      {list, Ports({shorter}), "the result[0]: field \"MTU\" is missing"},
      {PortShape(), MetaStruct::New("Nic"), "the result is structure \"Nic\", declared is \"Port\""},
  };
  for (const auto& one : cases) EXPECT_EQ(CheckResult(one.declared.get(), *one.posted), one.difference);
}

TEST(PlinthCheck, EndsACheckedRunThatBreaksItsDeclarations) {
  const auto probe = NewProbe(MetaBool::New());
  probe->parameters = {{"name", ParameterType::String, "n", "", false, false, {}}};
  const struct {
    ProbeCommand::Body body;
    const char* text;
    /// What an unchecked run makes of it.
    int status;
  } cases[] = {
      {[](const Input& input, Output&) { input.GetInt("name"); },
       "the command reads the parameter \"name\" as int, declared is string", kFailure},
      {[](const Input& input, Output&) { input.HasParameter("nam"); },
       "the command reads the parameter \"nam\", not declared", kFailure},
      {[](const Input&, Output& output) { output.Close(); }, "the command closes its output without a result",
       kFailure},
      {[](const Input&, Output& output) { output.SetResult(nullptr); }, "the command posts a null result",
       kFailure},
      {[](const Input&, Output& output) {
         Post(output, MetaBool::New(true));
         output.SetResult(MetaBool::New(true));
       },
       "the command posts a second result", kFailure},
      {[](const Input&, Output& output) { output.SetResult(MetaBool::New(true)); },
       "the command posts a result and does not close its output", kSuccess},
      {[](const Input&, Output& output) { Post(output, MetaInt::New(1)); },
       "the result is int, declared is bool", kSuccess},
  };
  for (const auto& one : cases) {
    probe->body = one.body;
    TextConsole console;
    const RunRecord record = RunCommand(*probe, {}, console, {.checked = false});
    EXPECT_EQ(record.status, one.status);
    EXPECT_EQ(record.failure, one.status == kFailure ? one.text : "");
    EXPECT_DEATH(RunCommand(*probe, {}, console, {.checked = true}), one.text);
  }
  probe->body = [](const Input&, Output& output) { Post(output, MetaBool::New(true)); };
  probe->SetDefaultOutputFormatter("tabel");
  TextConsole console;
  EXPECT_EQ(RunCommand(*probe, {}, console, {.checked = false}).status, kSuccess);
  EXPECT_DEATH(RunCommand(*probe, {}, console, {.checked = true}), "default format \"tabel\" is none");
}

/// Declares what the framework has not made.
class ForeignCommand final : public virtual AutoCli::Command {
 public:
  boost::shared_ptr<CallSpec::InputSpec> spec;

 private:
  struct Foreign final : CallSpec::OutputSpec {
    void SetResultType(boost::shared_ptr<MetaObject>) override {}
  };

  boost::shared_ptr<CallSpec::InputSpec> GetInputSpecInternal() override { return spec; }
  boost::shared_ptr<CallSpec::OutputSpec> GetOutputSpecInternal() override {
    return boost::shared_ptr<CallSpec::OutputSpec>(new Foreign);
  }
  void ExecuteInternal(boost::shared_ptr<Input>, boost::shared_ptr<Output>) override {}
};

TEST(PlinthTree, RefusesWhatItCannotRead) {
  const boost::shared_ptr<ForeignCommand> command(new ForeignCommand);
  ExpectLines(*command, {{{}, "hcli: a command declares no InputSpec\n", kFailure}});
  command->spec = CallSpec::InputSpec::New();
  ExpectLines(*command, {{{"--help"}, "hcli: a command's OutputSpec was not made by its New()\n", kFailure}});
}

TEST(PlinthTree, RefusesWhatItCannotHold) {
  const auto root = AutoCli::Namespace::New();
  const boost::shared_ptr<AutoCli::NamespaceNode> probe = NewProbe(MetaBool::New());
  root->RegisterNamespaceNode(probe, "probe");
  EXPECT_THROW(root->RegisterNamespaceNode(probe, "probe"), std::logic_error);
  EXPECT_THROW(root->RegisterNamespaceNode(probe, ""), std::logic_error);
  EXPECT_THROW(root->RegisterNamespaceNode(nullptr, "other"), std::logic_error);
  EXPECT_THROW(probe->RegisterNamespaceNode(AutoCli::Namespace::New(), "x"), std::logic_error);
}

}  // namespace
}  // namespace Plinth::Test
