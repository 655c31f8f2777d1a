#include <stdlib.h>

#include "plinth/OwnCommands.h"
#include "plinth/Shells.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

using CallSpec::ParameterSpec;
using CallSpec::ParameterType;

/// What the two commands share: they are for one of the shells, and give a text.
class ShellCommand : public virtual AutoCli::Command {
 protected:
  boost::shared_ptr<CallSpec::InputSpec> GetInputSpecInternal() override {
    auto shells = CallSpec::ParameterConstraint::New(CallSpec::ParameterConstraintType::StringEnum);
    for (const Shell& shell : kShells) shells->AddStringEnum(shell.name, "");
    auto shell = ParameterSpec::New("shell", ParameterType::String);
    shell->SetHelp("The shell to write for. %ENUM%");
    shell->SetConstraint(shells);
    shell->SetRequired(true);
    auto spec = CallSpec::InputSpec::New();
    spec->AddParameter(shell);
    return spec;
  }

  boost::shared_ptr<CallSpec::OutputSpec> GetOutputSpecInternal() override {
    auto spec = CallSpec::OutputSpec::New();
    spec->SetResultType(MetaObj::MetaString::New("Script"));
    return spec;
  }

  void ExecuteInternal(boost::shared_ptr<CallSpec::Input> input,
                       boost::shared_ptr<CallSpec::Output> output) override {
    const std::string name = input->GetString("shell");
    for (const Shell& shell : kShells) {
      if (name == shell.name) output->SetResult(MetaObj::MetaString::New(TextFor(shell, *input)));
    }
    output->Close();
  }

 private:
  virtual std::string TextFor(const Shell& shell, const CallSpec::Input& input) = 0;
};

class Completion final : public ShellCommand {
 public:
  Completion() {
    SetDescription("Write a script that lets a shell complete command lines.");
    SetMetaDataField("type", "fetcher");
  }

 private:
  std::string TextFor(const Shell& shell, const CallSpec::Input&) override { return shell.script; }
};

const char* FirstLine(const Candidates& candidates) {
  switch (candidates.files) {
    case Candidates::Files::All:
      return "files\n";
    case Candidates::Files::Folders:
      return "folders\n";
    case Candidates::Files::None:
      break;
  }
  return candidates.goesOn ? "open\n" : "words\n";
}

class Proposal final : public ShellCommand {
 public:
  explicit Proposal(AutoCli::Namespace& root) : root_(root) {
    SetDescription("Tell a shell what may follow in a command line.");
    SetMetaDataField("type", "fetcher");
  }

 private:
  boost::shared_ptr<CallSpec::InputSpec> GetInputSpecInternal() override {
    auto spec = ShellCommand::GetInputSpecInternal();
    auto columns = ParameterSpec::New("columns", ParameterType::Int);
    columns->SetHelp(
        "The width of the terminal, for a shell that leaves it to others to lay out descriptions.");
    spec->AddParameter(columns);
    return spec;
  }

  std::string TextFor(const Shell& shell, const CallSpec::Input& input) override {
    const char* const replaced = getenv("COMP_WORD");
    const int columns = input.GetInt("columns");
    const Question question{LineAtCursor(), replaced ? replaced : "",
                            static_cast<std::size_t>(columns > 0 ? columns : 0)};
    const OpenLine& line = question.line;
    Candidates candidates;
    if (line.isRedirection) {
      candidates.files = Candidates::Files::All;
    } else {
      candidates = CandidatesFor(root_, line.words, line.last);
    }
    for (Candidate& candidate : candidates.list) candidate.description = Visible(candidate.description);
    return FirstLine(candidates) + shell.answer(question, candidates);
  }

  AutoCli::Namespace& root_;
};

}  // namespace

OpenLine LineAtCursor() {
  const char* const variable = getenv("COMP_LINE");
  OpenLine line = ReadOpenLine(variable ? variable : "");
  if (!line.words.empty()) line.words.erase(line.words.begin());
  return line;
}

boost::shared_ptr<AutoCli::NamespaceNode> NewCompletion(AutoCli::Namespace&) {
  return boost::shared_ptr<AutoCli::NamespaceNode>(new Completion);
}

boost::shared_ptr<AutoCli::NamespaceNode> NewProposal(AutoCli::Namespace& root) {
  return boost::shared_ptr<AutoCli::NamespaceNode>(new Proposal(root));
}

}  // namespace Plinth
