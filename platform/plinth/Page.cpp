#include "plinth/Page.h"

#include <algorithm>
#include <utility>

#include "plinth/CommandLine.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

using AutoCli::Child;
using AutoCli::NodeData;
using CallSpec::ParameterType;
using Form = PageSection::Form;

constexpr std::pair<ExitStatus, const char*> kExitMeanings[] = {
    {kSuccess, "a result, nothing reported"},      {kReported, "something reported, no result"},
    {kUsage, "a wrong command line, nothing run"}, {kResultAndReported, "a result, and something reported"},
    {kFailure, "a failure of the program"},
};

std::string Placeholder(const Parameter& parameter) {
  switch (parameter.type) {
    case ParameterType::Int:
      return " NUMBER";
    case ParameterType::Bool:
      return " true|false";
    case ParameterType::Flag:
      return "";
    case ParameterType::String:
    case ParameterType::StringList:
      return " TEXT";
  }
  return "";
}

/// The help text, with the allowed values in place of %ENUM%, or behind it where it does not name them.
std::string HelpOf(const Parameter& parameter) {
  if (parameter.allowed.empty()) return parameter.help;
  const std::string values = "[" + Join(AllowedValues(parameter), ", ") + "]";
  bool named = false;
  std::string help = Expand(parameter.help, [&](std::string_view name, std::string& value) {
    if (name != "ENUM") return false;
    value = values;
    return named = true;
  });
  if (!named) help += (help.empty() ? "" : " ") + values;
  for (const AllowedValue& allowed : parameter.allowed) {
    if (!allowed.help.empty()) help += "\n" + allowed.value + ": " + allowed.help;
  }
  return help;
}

/// @p line in a line of its own behind @p text.
void AddLine(std::string& text, const std::string& line) {
  if (!text.empty() && !line.empty()) text += '\n';
  text += line;
}

}  // namespace

std::string ProgramWith(const std::string& path) { return path.empty() ? "hcli" : "hcli " + path; }

Page BeginPage(const Place& place) {
  Page page{place.path, {ProgramWith(place.path)}, NodeData::Of(place.node).description, {}};
  AutoCli::Command* const command = place.Command();
  if (!command) {
    if (place.path.empty()) page.synopsis.emplace_back("[GLOBAL OPTIONS]");
    page.synopsis.emplace_back("COMMAND...");
    page.synopsis.emplace_back("[OPTIONS]");
    return page;
  }
  bool optional = false;
  for (const Parameter& parameter : ParametersOf(*command->GetInputSpec())) {
    optional = optional || !parameter.required;
    if (!parameter.required) continue;
    const bool operand = MayBeOperand(parameter);
    page.synopsis.push_back((operand ? "[--" : "--") + parameter.name + (operand ? "]" : "") +
                            Placeholder(parameter));
  }
  if (optional) page.synopsis.emplace_back("[OPTIONS]");
  return page;
}

PageSection OptionsSection(const std::string& heading, const std::vector<Parameter>& parameters,
                           const std::function<std::string(const Parameter&)>& more) {
  PageSection section{heading, "", Form::Options};
  for (const Parameter& parameter : parameters) {
    PageItem& item = section.items.emplace_back();
    if (!parameter.shortName.empty()) item.term = '-' + parameter.shortName + ", ";
    item.term += "--" + parameter.name + Placeholder(parameter);
    if (parameter.required) item.term += " (required)";
    if (parameter.type == ParameterType::StringList) item.term += " (may be repeated)";
    item.text = HelpOf(parameter);
    if (parameter.sensitive) AddLine(item.text, "\"-\" reads it from standard input, without echo.");
    AddLine(item.text, more(parameter));
  }
  return section;
}

std::string SourceText(const Place& place, const Parameter& parameter,
                       const std::vector<std::string>& values) {
  const ValueSource* const source = place.OwnGuide().FindValues(place.path, parameter.name);
  if (!source || source->from.empty() || source->from == place.path || parameter.sensitive) return "";
  std::string text = "One of what \"" + ProgramWith(source->from) + "\" shows as " + source->field;
  if (!values.empty()) text += ": " + Join(values, ", ");
  return text + (source->isListed ? ". \"hcli explain\" tells what each is." : ".");
}

PageSection ResultSection(const Place& place) {
  const auto prototype = PrototypeOf(*place.Command()->GetOutputSpec());
  PageSection section{"Result", "", Form::Columns};
  if (!prototype) return section;
  section.text = TypeName(prototype->GetType());
  const MetaObj::MetaStruct* const structure = StructureOf(*prototype);
  if (!structure || structure->GetFieldCount() == 0) {
    const std::string& meaning = place.OwnGuide().ResultOf(place.path);
    if (!meaning.empty()) section.text += ". " + meaning;
    return section;
  }
  section.text += " with the fields";
  for (std::size_t index = 0; index < structure->GetFieldCount(); ++index) {
    section.items.push_back(
        {structure->GetFieldName(index), TypeName(structure->GetField(index)->GetType())});
  }
  return section;
}

PageSection ExamplesSection(const Place& place) {
  PageSection section{"Examples", "", Form::Examples};
  for (const Example& example : place.OwnGuide().ExamplesOf(place.path)) {
    section.items.push_back({example.about, example.line});
  }
  return section;
}

PageSection ExitSection() {
  PageSection section{"Exit status", "", Form::Columns};
  for (const auto& [status, meaning] : kExitMeanings) {
    section.items.push_back({std::to_string(static_cast<int>(status)), meaning});
  }
  return section;
}

std::vector<PageItem> GuideItems(const Place& place, KeyValues Guide::*part) {
  std::vector<PageItem> items;
  const auto add = [&](const Guide& guide) {
    for (const auto& [name, meaning] : guide.*part) {
      const auto isKnown = [&, &known = name](const PageItem& item) { return item.term == known; };
      if (std::none_of(items.begin(), items.end(), isKnown)) items.push_back({name, meaning});
    }
  };
  add(GuideTo(place.root, ""));
  add(place.OwnGuide());
  if (!place.path.empty()) return items;
  for (const Child& child : NodeData::Of(place.root).children) add(GuideTo(place.root, child.name));
  return items;
}

}  // namespace Plinth
