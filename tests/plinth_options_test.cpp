#include <Plinth/Patience.h>
#include <gtest/gtest.h>

#include <sstream>

#include "support/ProbeCommand.h"

namespace Plinth::Test {
namespace {

using CallSpec::ParameterType;
using Arguments = std::vector<std::string>;

/// A command with a parameter of each kind that writes down what it was given.
boost::shared_ptr<ProbeCommand> NewEcho() {
  auto echo = NewProbe(MetaObj::MetaString::New("Echo"));
  const std::vector<AllowedValue> ways = {{"uni", "one way"}, {"mutual", ""}};
  echo->parameters = {
      {"name", ParameterType::String, "n", "The name.", false, false, {}},
      {"count", ParameterType::Int, "c", "", false, false, {}},
      {"force", ParameterType::Bool, "f", "", false, false, {}},
      {"default", ParameterType::Flag, "d", "", false, false, {}},
      {"inherit", ParameterType::Flag, "i", "", false, false, {}},
      {"list", ParameterType::StringList, "l", "", false, false, {}},
      {"way", ParameterType::String, "w", "Which way. %ENUM%", false, false, ways},
      {"secret", ParameterType::String, "s", "", false, true, {}},
      {"key", ParameterType::String, "k", "", false, true, ways},
  };
  echo->body = [](const CallSpec::Input& input, CallSpec::Output& output) {
    std::ostringstream text;
    for (const char* key : {"name", "way", "secret", "key"}) {
      if (input.HasParameter(key)) text << key << '=' << input.GetString(key) << ';';
    }
    if (input.HasParameter("count")) text << "count=" << input.GetInt("count") << ';';
    if (input.HasParameter("force")) text << "force=" << input.GetBool("force") << ';';
    for (const char* key : {"default", "inherit"}) {
      if (input.HasParameter(key)) text << key << '=' << input.GetFlag(key) << ';';
    }
    Arguments values = {"stale"};
    input.GetStringList("list", values);
    for (const std::string& value : values) text << "list=" << value << ';';
    if (const char* trace = getenv("HCLI_TRACE")) text << "trace=" << trace << ';';
    Post(output, MetaObj::MetaString::New(text.str()));
  };
  return echo;
}

TEST(PlinthOptions, AreReadAsGnuProgramsDo) {
  ExpectLines(*NewEcho(),
              {
                  {{}, "\n"},
                  {{"--name=x=y"}, "name=x=y;\n"},
                  {{"-n=x"}, "name==x;\n"},
                  {{"--name="}, "name=;\n"},
                  {{"--name", ""}, "name=;\n"},
                  {{"--name", "--count"}, "name=--count;\n"},
                  {{"--name", "--"}, "name=--;\n"},
                  {{"-n", "-"}, "name=-;\n"},
                  {{"-din", "x"}, "name=x;default=1;inherit=1;\n"},
                  {{"-dinx"}, "name=x;default=1;inherit=1;\n"},
                  {{"-id=no"}, "default=0;inherit=1;\n"},
                  {{"--default=n"}, "default=0;\n"},
                  {{"--default=yes", "--"}, "default=1;\n"},
                  {{"--force", "0"}, "force=0;\n"},
                  {{"--force=y"}, "force=1;\n"},
                  {{"--count", "-2147483648"}, "count=-2147483648;\n"},
                  {{"-c+2147483647"}, "count=2147483647;\n"},
                  {{"-l", "a", "--list=b", "-lc", "--list="}, "list=a;list=b;list=c;list=;\n"},
                  {{"--list="}, "\n"},
                  {{"--way", ""}, "way=;\n"},
                  {{"--secret", "-", "--key=-"}, "secret=hidden;key=uni;\n"},
              },
              "hidden\nuni\nrest\n");
}

class RecordingPatience final : public Patience {
 public:
  std::chrono::milliseconds SetLimit(std::chrono::milliseconds limit) noexcept override {
    return std::exchange(now, limit);
  }
  std::chrono::milliseconds now{20000};
};

TEST(PlinthOptions, TimeoutHoldsForItsRunAlone) {
  static RecordingPatience patience;
  AddPatience(patience);
  const auto probe = NewProbe(MetaObj::MetaInt::New());
  probe->body = [](const CallSpec::Input&, CallSpec::Output& output) {
    Post(output, MetaObj::MetaInt::New(static_cast<int>(patience.now.count())));
  };
  ExpectLines(*probe, {{{}, "20000\n"},
                       {{"--timeout", "0"}, "0\n"},
                       {{"--timeout=.0001"}, "1\n"},
                       {{"--timeout=86400"}, "86400000\n"},
                       {{}, "20000\n"}});
}

TEST(PlinthOptions, AreRefusedInOneLineThatTellsWhatIsRight) {
  const std::vector<std::pair<Arguments, std::string>> cases = {
      {{"--nam", "x"}, "unknown option \"--nam\"; did you mean \"--name\"?"},
      {{"--zzzzzz=hidden"}, "unknown option \"--zzzzzz\"; --help lists the options"},
      {{"-L", "x"}, "unknown option \"-L\"; did you mean \"-l\"?"},
      {{"-dx"}, "unknown option \"-x\"; --help lists the options"},
      {{"--name\n=x"}, "unknown option \"--name\\n\"; did you mean \"--name\"?"},
      {{"--name"}, "option --name (-n) needs a value"},
      {{"--name", "x", "-ny"}, "option --name (-n) is given more than once"},
      {{"-dd"}, "option --default (-d) is given more than once"},
      {{"-c", "2147483648"},
       "option --count (-c): \"2147483648\" is not a whole number from -2147483648 to 2147483647"},
      {{"--count="}, "option --count (-c): \"\" is not a whole number from -2147483648 to 2147483647"},
      {{"-c+-1"}, "option --count (-c): \"+-1\" is not a whole number from -2147483648 to 2147483647"},
      {{"--default=True"},
       "option --default (-d): \"True\" is not a truth word: true, yes, y, 1, false, no, n or 0"},
      {{"--", "--default"}, "unexpected argument \"--default\"; give values behind their options"},
      {{"--way", "un"}, "option --way (-w): \"un\" is not one of: uni, mutual"},
      {{"--key", "hidden"}, "option --key (-k): the value is not one of: uni, mutual"},
      {{"--key", "-"}, "option --key (-k): the value is not one of: uni, mutual"},
      {{"--key=-", "--secret=-"}, "option --key (-k): standard input ended before the value"},
      {{"--output", "xml"}, "option --output: \"xml\" is not one of: simple, table, csv, json, yaml"},
      {{"--timeout=1e3"},
       "option --timeout: \"1e3\" is not a number of seconds from 0 to 86400, such as 20 or 0.5"},
      {{"--timeout=86400.1"},
       "option --timeout: \"86400.1\" is not a number of seconds from 0 to 86400, such as 20 or 0.5"},
      {{"--secret-file=x"},
       "option --secret-file: it could be the value of each of --secret (-s), --key (-k); give \"-\" as "
       "their "
       "values to have them read from standard input"},
      {{"--fields", "a"}, "option --fields: the result of this command has no fields"},
  };
  std::vector<Line> lines;
  lines.reserve(cases.size());
  for (const auto& [arguments, text] : cases) lines.push_back({arguments, "hcli: " + text + '\n', kUsage});
  ExpectLines(*NewEcho(), lines, "hidden\n");
}

TEST(PlinthOptions, MayStandWithoutTheirNamesWhereRequiredAndWithoutALetter) {
  const auto probe = NewProbe(MetaObj::MetaString::New(""));
  probe->parameters = {{"from", ParameterType::String, "", "", true, false, {}},
                       {"via", ParameterType::String, "v", "", true, false, {}},
                       {"to", ParameterType::String, "", "", true, false, {}}};
  probe->body = [](const CallSpec::Input& input, CallSpec::Output& output) {
    Post(output, MetaObj::MetaString::New(input.GetString("from") + ">" + input.GetString("to")));
  };
  ExpectLines(*probe, {
                          {{"b", "-vc", "--from", "a"}, "a>b\n"},
                          {{"-vc", "--", "-a", "--b"}, "-a>--b\n"},
                          {{}, "hcli: missing required options --from, --via (-v), --to\n", kUsage},
                          {{"a"}, "hcli: missing required options --via (-v), --to\n", kUsage},
                          {{"a", "b", "c", "-vd"},
                           "hcli: unexpected argument \"c\"; give values behind their options\n",
                           kUsage},
                      });
}

TEST(PlinthOptions, OfACommandWinOverGlobalOnesBehindTheWords) {
  const auto root = AutoCli::Namespace::New();
  const auto probe = NewProbe(MetaObj::MetaString::New(""));
  probe->parameters = {{"output", ParameterType::String, "h", "", false, false, {}}};
  probe->body = [](const CallSpec::Input& input, CallSpec::Output& output) {
    Post(output, MetaObj::MetaString::New(input.GetString("output")));
  };
  root->RegisterNamespaceNode(probe, "probe");
  const char* document = "{\"schema\": 1, \"status\": 0, \"messages\": [], \"result\": \"table\"}\n";
  ExpectLines(*root, {
                         {{"probe", "--output", "json"}, "json\n"},
                         {{"probe", "-hfile"}, "file\n"},
                         {{"--output", "json", "probe", "--output=table"}, document},
                     });
}

TEST(PlinthOptions, AreNotSoughtInValues) {
  const auto root = AutoCli::Namespace::New();
  root->RegisterNamespaceNode(NewEcho(), "probe");
  unsetenv("HCLI_TRACE");
  ExpectLines(
      *root,
      {
          {{"--output=simple", "probe", "--name", "--output=json"}, "name=--output=json;\n"},
          {{"probe", "-n", "--output", "-l", "json"}, "name=--output;list=json;\n"},
          {{"probe", "--name", "--trace"}, "name=--trace;\n"},
          {{"probe", "--plugins=/nowhere"},
           "hcli: option --plugins: give it in front of the first word; behind it, plug-ins are loaded\n",
           kUsage},
          {{"probe", "--count", "--output=json"},
           "hcli: option --count (-c): \"--output=json\" is not a whole number from "
           "-2147483648 to 2147483647\n",
           kUsage},
          {{"probe", "--trace"}, "trace=1;\n"},
          {{"probe"}, "\n"},
      });
}

// Everything that a run may say, with the value given in each place where it could leak.
TEST(PlinthOptions, NeverShowASensitiveValue) {
  const auto echo = NewEcho();
  for (const Arguments& given : {Arguments{"--secret=hidden", "--secret", "x"},
                                 {"--key", "hidden"},
                                 {"-khidden"},
                                 {"--secret=hidden", "--way=x"},
                                 {"--secret=hidden", "--no-such-option"},
                                 {"-shidden", "--help"}}) {
    for (const char* output : {"--output=simple", "--output=json"}) {
      Arguments arguments = given;
      arguments.push_back(output);
      TextConsole console;
      EXPECT_FALSE(RunCommand(*echo, arguments, console).executed);
      EXPECT_EQ((console.out.text + console.error.text).find("hidden"), std::string::npos);
    }
  }
}

}  // namespace
}  // namespace Plinth::Test
