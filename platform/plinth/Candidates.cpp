#include "plinth/Candidates.h"

#include <algorithm>

#include "plinth/Guide.h"
#include "plinth/Request.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

using AutoCli::NodeData;
using CallSpec::ParameterType;

/// What help says of the parameter first.
std::string FirstLine(const Parameter& parameter) {
  const std::string help = Expand(parameter.help, [&](std::string_view name, std::string& value) {
    value = Join(AllowedValues(parameter), ", ");
    return name == "ENUM";
  });
  return help.substr(0, help.find('\n'));
}

class CandidateFinder {
 public:
  CandidateFinder(AutoCli::Namespace& root, const std::vector<std::string>& words, const std::string& last)
      : root_(root), request_(ReadRequest(root, words)), last_(last) {
    for (const std::string& operand : request_.operands) {
      try {
        request_.own.TakeOperand(operand);
      } catch (const UsageError&) {
        // It is told when the line is run.
      }
    }
  }

  Candidates Find() {
    if (request_.isLost) return {};
    if (!request_.awaited.empty()) {
      AddValues(*FindOption(request_.awaited), "");
    } else if (request_.isOptionsEnd || last_[0] != '-') {
      AddWords();
    } else if (const std::size_t equals = last_.find('='); last_[1] == '-' && equals != last_.npos) {
      const Parameter* const option = FindOption(last_.substr(2, equals - 2));
      if (option) AddValues(*option, last_.substr(0, equals + 1));
    } else {
      AddOptions(request_.own);
      AddOptions(request_.global);
      if (last_[1] != '-') AddBehindLetters();
    }
    return std::move(found_);
  }

 private:
  /// The command's own option of that name, or the global one; null where there is neither.
  const Parameter* FindOption(const std::string& name) const {
    const Parameter* const own = request_.own.Find(name);
    return own ? own : request_.global.Find(name);
  }
  const Parameter* FindLetter(char letter) const {
    const Parameter* const own = request_.own.FindShort(letter);
    return own ? own : request_.global.FindShort(letter);
  }
  bool IsGlobal(const Parameter& parameter) const { return !request_.own.Find(parameter.name); }

  /// A list may be given again, and any other option once.
  bool MayBeGiven(const Parameter& option) const {
    const OptionTable& table = IsGlobal(option) ? request_.global : request_.own;
    return option.type == ParameterType::StringList || !table.For(option).given;
  }

  void Add(const std::string& word, const std::string& description) {
    if (word.starts_with(last_)) found_.list.push_back({word, description});
  }

  void AddOptions(const OptionTable& table) {
    for (const Parameter& option : table.Parameters()) {
      if (FindOption(option.name) != &option || !MayBeGiven(option)) continue;
      // Behind the first word, plug-ins are loaded.
      if (option.name == "plugins" && !request_.path.empty()) continue;
      Add("--" + option.name, FirstLine(option));
    }
  }

  /// "-Ahba1": values of the last letter's option, behind others that are flags.
  void AddBehindLetters() {
    for (std::size_t at = 1; at < last_.size(); ++at) {
      const Parameter* const option = FindLetter(last_[at]);
      if (!option) return;
      if (option->type != ParameterType::Flag) return AddValues(*option, last_.substr(0, at + 1));
      if (at + 1 < last_.size() && last_[at + 1] == '=') return AddValues(*option, last_.substr(0, at + 2));
    }
    if (last_.size() > 1) Add(last_, FirstLine(*FindLetter(last_.back())));
  }

  /// What may stand without a dash in front, and the command's options where nothing is written yet.
  void AddWords() {
    const NodeData& place = NodeData::Of(*request_.node);
    if (!place.isCommand) {
      if (request_.global.For("batch").given) return;  // the words stand in the file
      return AddChildren(place, "");
    }
    for (const Parameter& parameter : request_.own.Parameters()) {
      if (!MayBeOperand(parameter) || !MayBeGiven(parameter)) continue;
      AddValues(parameter, "");
      break;
    }
    if (last_.empty() && found_.files == Candidates::Files::None && !request_.isOptionsEnd) {
      AddOptions(request_.own);
    }
  }

  /// The values of @p parameter, with @p before in front.
  void AddValues(const Parameter& parameter, const std::string& before) {
    if (parameter.sensitive || !MayBeGiven(parameter)) return;
    if (parameter.type == ParameterType::Bool || parameter.type == ParameterType::Flag) {
      Add(before + "true", "");
      Add(before + "false", "");
      if (last_ == before) return;
      // Two are enough to choose from.
      Add(before + "yes", "");
      Add(before + "no", "");
    } else if (!parameter.allowed.empty()) {
      for (const AllowedValue& allowed : parameter.allowed) Add(before + allowed.value, allowed.help);
    } else if (IsGlobal(parameter) && parameter.name == "fields") {
      AddFields(before);
    } else {
      const std::string path = IsGlobal(parameter) ? "" : request_.path;
      const ValueSource* const source = GuideTo(root_, path).FindValues(path, parameter.name);
      if (source) AddKnown(parameter, *source, before);
    }
  }

  void AddChildren(const NodeData& place, const std::string& before) {
    for (const AutoCli::Child& child : place.children) {
      Add(before + child.name, NodeData::Of(*child.node).description);
    }
  }

  void AddKnown(const Parameter& parameter, const ValueSource& source, const std::string& before) {
    switch (source.kind) {
      case ValueSource::Kind::File:
        found_.files = Candidates::Files::All;
        break;
      case ValueSource::Kind::Folder:
        found_.files = Candidates::Files::Folders;
        break;
      case ValueSource::Kind::Command: {
        // Of a list, the values so far are the words that lead there.
        const AutoCli::NamespaceNode* node = &root_;
        for (const std::string& word : request_.own.For(parameter).texts) {
          if (node) node = NodeData::FindChild(*node, word);
        }
        if (node) AddChildren(NodeData::Of(*node), before);
        break;
      }
      case ValueSource::Kind::Shown:
        for (const Candidate& value : ShownValues(root_, OptionsFor(source), source)) {
          Add(before + value.word, value.description);
        }
    }
  }

  /// Those of the line at hand that narrow down what the source shows.
  std::vector<std::string> OptionsFor(const ValueSource& source) const {
    std::vector<std::string> options;
    for (const std::string& name : source.with) {
      const Parameter* const option = request_.own.Find(name);
      if (!option || option->sensitive) continue;
      for (const std::string& text : request_.own.For(*option).texts) {
        options.push_back("--" + name + '=' + text);
      }
    }
    return options;
  }

  /// The fields of the command's result that are not named yet.
  void AddFields(const std::string& before) {
    auto* const command = dynamic_cast<AutoCli::Command*>(request_.node);
    const auto prototype = command ? PrototypeOf(*command->GetOutputSpec()) : nullptr;
    const MetaObj::MetaStruct* const structure = prototype ? StructureOf(*prototype) : nullptr;
    if (!structure) return;
    found_.goesOn = true;
    std::vector<std::string> named = Split(last_.substr(before.size()), ',');
    named.pop_back();
    const std::string front = before + Join(named, ",") + (named.empty() ? "" : ",");
    const Guide& guide = GuideTo(root_, request_.path);
    for (const std::string& name : FieldNames(*structure)) {
      if (std::find(named.begin(), named.end(), name) != named.end()) continue;
      Add(front + name, guide.MeaningOf(structure->GetTypeName(), name));
    }
  }

  AutoCli::Namespace& root_;
  Request request_;
  const std::string& last_;
  Candidates found_;
};

}  // namespace

Candidates CandidatesFor(AutoCli::Namespace& root, const std::vector<std::string>& words,
                         const std::string& last) {
  return CandidateFinder(root, words, last).Find();
}

}  // namespace Plinth
