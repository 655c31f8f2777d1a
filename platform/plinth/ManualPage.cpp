#include <algorithm>

#include "plinth/GlobalOptions.h"
#include "plinth/Manual.h"
#include "plinth/Page.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

using AutoCli::NodeData;
using Form = PageSection::Form;

const char* Words(MetaObj::MetaType type) {
  switch (type) {
    case MetaObj::MetaType::Bool:
      return "A truth value";
    case MetaObj::MetaType::Int:
      return "A number";
    case MetaObj::MetaType::String:
      return "A text";
    case MetaObj::MetaType::Struct:
      return "A structure";
    case MetaObj::MetaType::List:
      return "A list of structures";
  }
  return "A value";
}

/// The fields with their meanings.
PageSection ExplainedResult(const Place& place) {
  PageSection section = ResultSection(place);
  section.form = Form::Options;
  const auto prototype = PrototypeOf(*place.Command()->GetOutputSpec());
  if (!prototype) return section;
  const MetaObj::MetaStruct* const structure = StructureOf(*prototype);
  section.text = Words(prototype->GetType());
  const std::string& meaning = place.OwnGuide().ResultOf(place.path);
  section.text += !section.items.empty() ? " with these fields:" : meaning.empty() ? "." : ". " + meaning;
  for (PageItem& item : section.items) {
    const std::string type = item.text;
    item.text = place.OwnGuide().MeaningOf(structure->GetTypeName(), item.term);
    item.term += " (" + type + ')';
  }
  return section;
}

/// Every command, with what it does.
PageSection CommandsSection(AutoCli::NamespaceNode& root) {
  PageSection section{"Commands", "", Form::Options};
  for (const Place& command : CommandPlaces(root)) {
    section.items.push_back({ProgramWith(command.path), NodeData::Of(command.node).description});
  }
  return section;
}

/// The root's page, the commands beside this one, and those that show its values; for the root, the
/// framework's own.
std::string SeeAlso(const Place& place) {
  std::vector<std::string> names;
  const auto add = [&](const std::string& path) {
    const std::string name = PageName(path) + "(1)";
    if (path != place.path && std::find(names.begin(), names.end(), name) == names.end())
      names.push_back(name);
  };
  add("");
  const std::size_t end = place.path.rfind(' ');
  const std::string parent = end == place.path.npos ? "" : place.path.substr(0, end);
  for (const Place& other : CommandPlaces(place.root)) {
    const std::size_t last = other.path.rfind(' ');
    if ((last == other.path.npos ? "" : other.path.substr(0, last)) == parent) add(other.path);
  }
  if (AutoCli::Command* const command = place.Command()) {
    for (const Parameter& parameter : ParametersOf(*command->GetInputSpec())) {
      const ValueSource* const source = place.OwnGuide().FindValues(place.path, parameter.name);
      if (source && !source->from.empty()) add(source->from);
    }
  }
  return Join(names, ", ");
}

void Add(Page& page, PageSection section) {
  if (!section.items.empty() || !section.text.empty()) page.sections.push_back(std::move(section));
}

}  // namespace

Page ManualPage(const Place& place) {
  Page page = BeginPage(place);
  if (AutoCli::Command* const command = place.Command()) {
    Add(page, OptionsSection("Options", ParametersOf(*command->GetInputSpec()),
                             [&](const Parameter& parameter) { return SourceText(place, parameter); }));
    Add(page, ExplainedResult(place));
    Add(page, ExamplesSection(place));
  } else {
    page.description = "A command line for managing a host.";
    Add(page, CommandsSection(place.root));
    Add(page, OptionsSection("Global options", GlobalParameters(), [](const Parameter&) { return ""; }));
  }
  Add(page, ExitSection());
  Add(page, {"Environment", "", Form::Options, GuideItems(place, &Guide::environment)});
  Add(page, {"Files", "", Form::Options, GuideItems(place, &Guide::files)});
  Add(page, {"See also", SeeAlso(place)});
  return page;
}

}  // namespace Plinth
