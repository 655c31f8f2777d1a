#include "plinth/CommandLine.h"

#include <stdlib.h>

#include <algorithm>
#include <cstring>
#include <new>
#include <utility>

#include "plinth/Declarations.h"
#include "plinth/Failure.h"
#include "plinth/Formatter.h"
#include "plinth/Options.h"
#include "plinth/Run.h"
#include "plinth/Text.h"

namespace Plinth {

using AutoCli::Command;
using AutoCli::NamespaceNode;
using AutoCli::NodeData;

bool IsCheckedBuild() {
#ifdef HCLI_CHECKED
  return true;
#else
  return false;
#endif
}

namespace {

std::string UnknownWord(const NamespaceNode& node, const std::string& path, const std::string& word) {
  const std::vector<std::string> names = NodeData::ChildNames(node);
  const std::string where = path.empty() ? "" : " in " + Quoted(path);
  std::string right = Nearest(word, names);
  if (!right.empty()) {
    right = "did you mean " + Quoted(right) + "?";
  } else {
    right = names.empty() ? "there are none" : "there are: " + Join(names, ", ");
  }
  return "unknown command " + Quoted(word) + where + "; " + right;
}

/// One command line from its words to what is shown.
class Runner {
 public:
  Runner(NamespaceNode& start, const std::vector<std::string>& arguments, Console& console,
         RunOptions options)
      : node_(&start),
        arguments_(arguments),
        console_(console),
        options_(options),
        global_(GlobalParameters()) {}

  RunRecord Run() {
    try {
      ResolveWords();
      if (NodeData::Of(*node_).isCommand) {
        RunLeaf(dynamic_cast<Command&>(*node_));
      } else {
        ShowText(global_.For("version").truth ? VersionText() : HelpText(*node_, record_.path));
      }
    } catch (const UsageError& error) {
      Fail(kUsage, error.what());
    } catch (...) {
      Fail(kFailure, CurrentExceptionText());
    }
    Show();
    return std::move(record_);
  }

 private:
  static std::string VersionText() { return "hcli " HCLI_VERSION "\n"; }

  /// Moves from namespace to namespace until a command or the end of the arguments is reached.
  void ResolveWords() {
    while (!NodeData::Of(*node_).isCommand && at_ < arguments_.size()) {
      if (TakeOptions({&global_})) continue;
      const std::string& word = arguments_[at_];
      NamespaceNode* child = NodeData::FindChild(*node_, word);
      if (!child) throw UsageError(UnknownWord(*node_, record_.path, word));
      record_.path += (record_.path.empty() ? "" : " ") + word;
      node_ = child;
      ++at_;
    }
  }

  /// Reads an option, or the "--" behind which there are none. False where a word stands next.
  bool TakeOptions(const std::vector<OptionTable*>& tables) {
    if (onlyWords_) return false;
    if (arguments_[at_] == "--") {
      onlyWords_ = true;
      ++at_;
      return true;
    }
    if (!IsOption(arguments_[at_])) return false;
    const bool isHeeded = record_.path.empty() || global_.For("plugins").given;
    ReadOption(arguments_, at_, tables);
    if (!isHeeded && global_.For("plugins").given) {
      throw UsageError(
          "option --plugins: give it in front of the first word; behind it, plug-ins are loaded");
    }
    return true;
  }

  void RunLeaf(Command& command) {
    OptionTable own(ParametersOf(*command.GetInputSpec()));
    ownsOutput_ = own.Find("output") != nullptr;
    std::vector<std::string> operands;
    while (at_ < arguments_.size()) {
      if (!TakeOptions({&own, &global_})) operands.push_back(arguments_[at_++]);
    }
    if (global_.For("help").truth) return ShowText(HelpText(command, record_.path));
    if (global_.For("version").truth) return ShowText(VersionText());
    for (const std::string& operand : operands) {
      if (!own.TakeOperand(operand)) {
        throw UsageError("unexpected argument " + Quoted(operand) + "; give values behind their options");
      }
    }
    own.RequireAll();
    ReadFields(command);
    own.ReadSecrets(console_);
    Execute(command, own);
  }

  /// Holds the fields that the user named against those that the command declares.
  void ReadFields(Command& command) {
    const Given& given = global_.For("fields");
    if (!given.given) return;
    fields_ = Split(given.texts.front(), ',');
    const auto prototype = PrototypeOf(*command.GetOutputSpec());
    const MetaObj::MetaStruct* structure = prototype ? StructureOf(*prototype) : nullptr;
    if (!structure) throw UsageError("option --fields: the result of this command has no fields");
    const std::vector<std::string> names = FieldNames(*structure);
    for (std::size_t index = 0; index < fields_.size(); ++index) {
      const auto here = fields_.begin() + static_cast<std::ptrdiff_t>(index);
      if (std::find(fields_.begin(), here, *here) != here) {
        throw UsageError("option --fields: " + Quoted(*here) + " is named twice");
      }
      // A structure declared without fields is open: which it has shows only when it is there.
      if (here->empty() || (!names.empty() && std::find(names.begin(), names.end(), *here) == names.end())) {
        throw UsageError("option --fields: there is no field " + Quoted(*here) +
                         "; there are: " + Join(names, ","));
      }
    }
  }

  void Execute(Command& command, const OptionTable& own) {
    const boost::shared_ptr<CallSpec::Input> input(new RunInput(own, options_.checked));
    const boost::shared_ptr<CallSpec::Output> output(
        new RunOutput(record_, console_.Error(), options_.checked));
    if (global_.For("trace").given) setenv("HCLI_TRACE", global_.For("trace").truth ? "1" : "0", 1);
    record_.executed = true;
    command.Execute(input, output);
    if (options_.checked) CheckRun(command);
    if (!record_.result && record_.messages.empty()) {
      return Fail(kFailure, "the command ended with neither a result nor a report");
    }
    record_.status = !record_.result ? kReported : record_.messages.empty() ? kSuccess : kResultAndReported;
    shown_ = record_.result.get();
  }

  void CheckRun(Command& command) {
    if (!record_.result) return;
    if (!record_.closed) RaiseFault(true, Named("the command posts a result and does not close its output"));
    const std::string difference = CheckResult(PrototypeOf(*command.GetOutputSpec()).get(), *record_.result);
    if (!difference.empty()) RaiseFault(true, Named(difference));
  }

  std::string Named(const std::string& text) const {
    return record_.path.empty() ? text : record_.path + ": " + text;
  }

  void Fail(int status, const std::string& text) {
    record_.status = status;
    record_.failure = Visible(text);
    shown_ = nullptr;
    console_.Error().Write("hcli: " + record_.failure + '\n');
    console_.Error().Flush();
  }

  /// Help and version are texts, not results of a command.
  void ShowText(const std::string& text) {
    text_ = MetaObj::MetaString::New(text);
    shown_ = text_.get();
  }

  const Formatter& ChosenFormatter() const {
    if (MayWantJson()) return JsonFormatter();
    const Given& given = global_.For("output");
    const Formatter* formatter = given.given ? FindFormatter(given.texts.front()) : nullptr;
    if (!formatter && !text_) formatter = FindFormatter(NodeData::Of(*node_).formatter);
    return formatter ? *formatter : SimpleFormatter();
  }

  /// Where the line was wrong, the rest of it was not read, and a document is owed all the same.
  bool MayWantJson() const {
    if (ownsOutput_ || onlyWords_) return false;
    for (std::size_t at = at_; at < arguments_.size() && arguments_[at] != "--"; ++at) {
      if (arguments_[at] == "--output=json") return true;
      if (arguments_[at] == "--output" && at + 1 < arguments_.size() && arguments_[at + 1] == "json")
        return true;
    }
    return false;
  }

  void Show() {
    const Formatter& formatter = ChosenFormatter();
    if (shown_ || formatter.IsDocument()) {
      Report report;
      report.status = record_.status;
      report.messages = record_.messages;
      if (!record_.failure.empty()) report.messages.push_back(record_.failure);
      report.result = shown_;
      report.fields = fields_;
      report.settings = NodeData::Of(*node_).formatterParameters;
      formatter.Write(report, console_.Out());
    }
    if (const int error = console_.Out().Flush()) {
      Fail(kFailure, std::string("cannot write to standard output: ") + std::strerror(error));
    }
  }

  NamespaceNode* node_;
  const std::vector<std::string>& arguments_;
  Console& console_;
  RunOptions options_;
  OptionTable global_;
  /// The next argument; at the end the first that was not read.
  std::size_t at_ = 0;
  bool onlyWords_ = false;
  bool ownsOutput_ = false;
  std::vector<std::string> fields_;
  boost::shared_ptr<MetaObj::MetaObject> text_;
  const MetaObj::MetaObject* shown_ = nullptr;
  RunRecord record_;
};

}  // namespace

RunRecord OutOfMemory(Console& console) {
  RunRecord record;
  record.status = kFailure;
  record.failure = kOutOfMemory;  // short enough for a string to hold by itself
  console.Error().Write("hcli: ");
  console.Error().Write(kOutOfMemory);
  console.Error().Write("\n");
  console.Error().Flush();
  return record;
}

RunRecord RunCommandLine(AutoCli::Namespace& root, const std::vector<std::string>& arguments,
                         Console& console, RunOptions options) try {
  return Runner(root, arguments, console, options).Run();
} catch (const std::bad_alloc&) {
  return OutOfMemory(console);
}

RunRecord RunCommand(Command& command, const std::vector<std::string>& arguments, Console& console,
                     RunOptions options) try {
  return Runner(command, arguments, console, options).Run();
} catch (const std::bad_alloc&) {
  return OutOfMemory(console);
}

}  // namespace Plinth
