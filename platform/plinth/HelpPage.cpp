#include <algorithm>

#include "plinth/Candidates.h"
#include "plinth/GlobalOptions.h"
#include "plinth/OwnCommands.h"
#include "plinth/Page.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

using AutoCli::NodeData;
using Form = PageSection::Form;

bool KnowsMeanings(const Place& place) {
  const auto prototype = PrototypeOf(*place.Command()->GetOutputSpec());
  const MetaObj::MetaStruct* const structure = prototype ? StructureOf(*prototype) : nullptr;
  return structure && place.OwnGuide().fields.contains(structure->GetTypeName());
}

/// What "--adapter" is in options such as "--adapter=hba1"; null where it is not among them.
const std::string* FindOption(const std::vector<std::string>& options, const std::string& name) {
  const auto isIt = [&](const std::string& option) { return option.starts_with("--" + name + '='); };
  const auto found = std::find_if(options.begin(), options.end(), isIt);
  return found == options.end() ? nullptr : &*found;
}

AutoCli::Command* FindCommand(AutoCli::NamespaceNode& root, const std::string& path) {
  AutoCli::NamespaceNode* node = &root;
  for (const std::string& word : Split(path, ' ')) node = node ? NodeData::FindChild(*node, word) : nullptr;
  return dynamic_cast<AutoCli::Command*>(node);
}

/// The values that the host has for an option whose values are few, narrowed down by the options of the line.
/// What else the command that shows them requires is what the host shows first of that.
std::vector<std::string> AskForValues(const Place& place, const Parameter& parameter) {
  const ValueSource* const source = place.OwnGuide().FindValues(place.path, parameter.name);
  auto* const root = dynamic_cast<AutoCli::Namespace*>(&place.root);
  if (!place.isAsking || !source || !source->isListed || !root) return {};
  AutoCli::Command* const command = FindCommand(place.root, source->from);
  if (!command) return {};
  std::vector<std::string> options;
  for (const Parameter& needed : ParametersOf(*command->GetInputSpec())) {
    if (const std::string* const given = FindOption(place.options, needed.name)) {
      options.push_back(*given);
    } else if (needed.required) {
      const ValueSource* const other = place.OwnGuide().FindValues(source->from, needed.name);
      const std::vector<Candidate> values =
          other ? ShownValues(*root, options, *other) : std::vector<Candidate>();
      if (values.empty()) return {};
      options.push_back("--" + needed.name + '=' + values.front().word);
    }
  }
  const std::vector<Candidate> shown = ShownValues(*root, options, *source);
  std::vector<std::string> values(shown.size());
  std::transform(shown.begin(), shown.end(), values.begin(),
                 [](const Candidate& value) { return value.word; });
  return values;
}

/// "0 this; 1 that."
std::string Sentence(const std::vector<PageItem>& items) {
  std::vector<std::string> parts(items.size());
  std::transform(items.begin(), items.end(), parts.begin(),
                 [](const PageItem& item) { return item.term + ' ' + item.text; });
  return Join(parts, "; ") + '.';
}

Page CommandPage(const Place& place) {
  Page page = BeginPage(place);
  PageSection options = OptionsSection("Options", ParametersOf(*place.Command()->GetInputSpec()),
                                       [&](const Parameter& parameter) {
                                         return SourceText(place, parameter, AskForValues(place, parameter));
                                       });
  if (!options.items.empty()) page.sections.push_back(std::move(options));
  page.sections.push_back(ResultSection(place));
  if (KnowsMeanings(place)) {
    page.sections.push_back({"", "\"hcli explain " + place.path + "\" tells what the fields mean."});
  }
  PageSection examples = ExamplesSection(place);
  if (!examples.items.empty()) page.sections.push_back(std::move(examples));
  page.sections.push_back({"Exit status", Sentence(ExitSection().items)});
  std::vector<std::string> variables;
  for (const PageItem& item : GuideItems(place, &Guide::environment)) variables.push_back(item.term);
  std::string end = "\"hcli --help\" lists the global options";
  if (!variables.empty()) end += ", and tells of the variables " + Join(variables, ", ");
  page.sections.push_back({"", end + '.'});
  return page;
}

}  // namespace

Page HelpPage(const Place& place) {
  if (place.Command()) return CommandPage(place);
  Page page = BeginPage(place);
  PageSection commands{"Commands", "", Form::Columns};
  for (const AutoCli::Child& child : NodeData::Of(place.node).children) {
    commands.items.push_back({Visible(child.name), NodeData::Of(*child.node).description});
  }
  if (commands.items.empty() && place.path != kHelpWord) commands = {"", "There are no commands here."};
  if (!commands.items.empty() || !commands.text.empty()) page.sections.push_back(std::move(commands));
  if (!place.path.empty()) return page;
  page.sections.push_back(
      OptionsSection("Global options", GlobalParameters(), [](const Parameter&) { return ""; }));
  page.sections.push_back(ExitSection());
  std::vector<PageItem> variables = GuideItems(place, &Guide::environment);
  if (!variables.empty()) page.sections.push_back({"Environment", "", Form::Columns, std::move(variables)});
  return page;
}

}  // namespace Plinth
