#include "plinth/Request.h"

#include <algorithm>

#include "plinth/CommandLine.h"
#include "plinth/Declarations.h"
#include "plinth/Failure.h"
#include "plinth/OwnCommands.h"
#include "plinth/Text.h"

namespace Plinth {

using AutoCli::Command;
using AutoCli::NamespaceNode;
using AutoCli::NodeData;

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

class RequestReader {
 public:
  RequestReader(NamespaceNode& start, const std::vector<std::string>& arguments)
      : arguments_(arguments), request_(start) {}

  Request Read() {
    Attempt([&] { Enter(); });
    while (at_ < arguments_.size()) {
      if (!request_.isOptionsEnd && arguments_[at_] == "--") {
        request_.isOptionsEnd = true;
        ++at_;
      } else if (!request_.isOptionsEnd && IsOption(arguments_[at_])) {
        Attempt([&] { TakeOption(); });
      } else {
        Attempt([&] { TakeWord(arguments_[at_++]); });
      }
    }
    if (request_.path == kExplainWord && IsEmpty()) request_.isHelp = true;
    return std::move(request_);
  }

 private:
  /// Keeps the first fault, and lets the reading go on.
  template <class Step>
  void Attempt(Step step) {
    try {
      step();
    } catch (const MissingValue& missing) {
      request_.awaited = missing.option;
      Note(kUsage, missing.what());
    } catch (const UsageError& error) {
      Note(kUsage, error.what());
    } catch (...) {
      Note(kFailure, CurrentExceptionText());
    }
  }

  void Note(int status, const std::string& fault) {
    if (request_.status != kSuccess) return;
    request_.status = status;
    request_.fault = fault;
  }

  /// True where the command is given nothing.
  bool IsEmpty() const {
    const auto& parameters = request_.own.Parameters();
    return request_.operands.empty() &&
           std::none_of(parameters.begin(), parameters.end(),
                        [&](const Parameter& parameter) { return request_.own.For(parameter).given; });
  }

  bool IsAtCommand() const { return NodeData::Of(*request_.node).isCommand; }

  void Enter() {
    if (IsAtCommand()) {
      request_.own = OptionTable(ParametersOf(*dynamic_cast<Command&>(*request_.node).GetInputSpec()));
    }
  }

  void TakeOption() {
    const bool isHeeded = request_.path.empty() || request_.global.For("plugins").given;
    ReadOption(arguments_, at_, {&request_.own, &request_.global});
    if (!isHeeded && request_.global.For("plugins").given) {
      throw UsageError(
          "option --plugins: give it in front of the first word; behind it, plug-ins are loaded");
    }
  }

  /// A step further in the tree, or an operand.
  void TakeWord(const std::string& word) {
    if (request_.isLost) return;
    if (IsAtCommand()) return request_.operands.push_back(word);
    NamespaceNode* child = NodeData::FindChild(*request_.node, word);
    if (!child) {
      request_.isLost = true;
      throw UsageError(UnknownWord(*request_.node, request_.path, word));
    }
    if (request_.path.empty() && word == kHelpWord && !request_.isHelp) {
      request_.isHelp = true;
      return;
    }
    request_.path += (request_.path.empty() ? "" : " ") + word;
    request_.node = child;
    Enter();
  }

  const std::vector<std::string>& arguments_;
  std::size_t at_ = 0;
  Request request_;
};

}  // namespace

Request ReadRequest(NamespaceNode& start, const std::vector<std::string>& arguments) {
  return RequestReader(start, arguments).Read();
}

void Complete(Request& request) {
  for (const std::string& operand : request.operands) {
    if (!request.own.TakeOperand(operand)) {
      throw UsageError("unexpected argument " + Quoted(operand) + "; give values behind their options");
    }
  }
  request.own.RequireAll();
}

}  // namespace Plinth
