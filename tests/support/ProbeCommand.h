/// A command whose declarations and work a test writes down in a line each.
#pragma once

#include <Plinth/AutoCli.h>
#include <gtest/gtest.h>

#include <functional>
#include <utility>

#include "plinth/CommandLine.h"
#include "plinth/Declarations.h"

namespace Plinth::Test {

class ProbeCommand final : public virtual AutoCli::Command {
 public:
  using Body = std::function<void(const CallSpec::Input&, CallSpec::Output&)>;

  std::vector<Parameter> parameters;
  boost::shared_ptr<MetaObj::MetaObject> prototype;
  Body body;

  using Command::SetDefaultOutputFormatter;
  using Command::SetDefaultOutputParameter;
  using Command::SetMetaDataField;

 private:
  boost::shared_ptr<CallSpec::InputSpec> GetInputSpecInternal() override {
    auto spec = CallSpec::InputSpec::New();
    for (const Parameter& parameter : parameters) {
      auto declared = CallSpec::ParameterSpec::New(parameter.name, parameter.type);
      declared->SetShortName(parameter.shortName);
      declared->SetHelp(parameter.help);
      declared->SetRequired(parameter.required);
      declared->SetSensitive(parameter.sensitive);
      if (!parameter.allowed.empty()) {
        auto constraint = CallSpec::ParameterConstraint::New(CallSpec::ParameterConstraintType::StringEnum);
        for (const AllowedValue& allowed : parameter.allowed) {
          constraint->AddStringEnum(allowed.value, allowed.help);
        }
        declared->SetConstraint(constraint);
      }
      spec->AddParameter(declared);
    }
    return spec;
  }
  boost::shared_ptr<CallSpec::OutputSpec> GetOutputSpecInternal() override {
    auto spec = CallSpec::OutputSpec::New();
    spec->SetResultType(prototype);
    return spec;
  }
  void ExecuteInternal(boost::shared_ptr<CallSpec::Input> input,
                       boost::shared_ptr<CallSpec::Output> output) override {
    body(*input, *output);
  }
};

inline void Post(CallSpec::Output& output, boost::shared_ptr<MetaObj::MetaObject> result) {
  output.SetResult(std::move(result));
  output.Close();
}

/// A probe that posts @p result, which is its prototype too.
inline boost::shared_ptr<ProbeCommand> NewProbe(boost::shared_ptr<MetaObj::MetaObject> result) {
  boost::shared_ptr<ProbeCommand> probe(new ProbeCommand);
  probe->prototype = result;
  probe->body = [result](const CallSpec::Input&, CallSpec::Output& output) { Post(output, result); };
  return probe;
}

/// What a run with @p arguments shows, and its exit status.
struct Line {
  std::vector<std::string> arguments;
  std::string shown;
  int status = kSuccess;
};

/// @p node is a command, or a namespace in which the arguments begin with a path. A success says nothing on
/// standard error; a usage error says all it says there, and nothing is run.
inline void ExpectLines(AutoCli::NamespaceNode& node, const std::vector<Line>& lines,
                        const std::string& input = "") {
  auto* const command = dynamic_cast<AutoCli::Command*>(&node);
  for (const auto& [arguments, shown, status] : lines) {
    SCOPED_TRACE(testing::PrintToString(arguments));
    TextConsole console;
    console.input = input;
    const RunRecord record =
        command != nullptr ? RunCommand(*command, arguments, console)
                           : RunCommandLine(dynamic_cast<AutoCli::Namespace&>(node), arguments, console);
    EXPECT_EQ(status == kUsage ? "" : console.out.text, console.out.text);
    EXPECT_EQ(status == kSuccess ? "" : console.error.text, console.error.text);
    EXPECT_EQ(console.out.text + console.error.text, shown);
    EXPECT_EQ(record.status, status);
    EXPECT_FALSE(status == kUsage && record.executed);
    EXPECT_EQ(status == kUsage ? "hcli: " + record.failure + '\n' : shown, shown);
  }
}

}  // namespace Plinth::Test
