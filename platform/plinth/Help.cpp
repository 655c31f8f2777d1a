#include <algorithm>

#include "plinth/CommandLine.h"
#include "plinth/Declarations.h"
#include "plinth/GlobalOptions.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

using AutoCli::Child;
using AutoCli::NodeData;
using CallSpec::ParameterType;

/// @p text with its own lines, each broken at blanks to fit behind @p indent blanks within @p screen columns.
/// The first line has no indent: something stands in front of it.
std::string Wrap(const std::string& text, std::size_t indent, std::size_t screen) {
  std::string wrapped;
  for (const std::string& line : Split(Visible(text, Lines::Kept), '\n')) {
    if (!wrapped.empty()) wrapped += '\n' + std::string(indent, ' ');
    std::size_t column = indent;
    for (const std::string& word : Split(line, ' ')) {
      const std::size_t width = DisplayWidth(word);
      if (column > indent && column + 1 + width > screen) {
        wrapped += '\n' + std::string(indent, ' ');
        column = indent;
      } else if (column > indent) {
        wrapped += ' ';
        ++column;
      }
      wrapped += word;
      column += width;
    }
  }
  return wrapped;
}

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

std::string OptionsText(const std::vector<Parameter>& parameters, std::size_t screen) {
  std::string text;
  for (const Parameter& parameter : parameters) {
    text += parameter.shortName.empty() ? "      " : "  -" + parameter.shortName + ", ";
    text += "--" + parameter.name + Placeholder(parameter);
    if (parameter.required) text += " (required)";
    if (parameter.type == ParameterType::StringList) text += " (may be repeated)";
    text += '\n';
    std::string help = HelpOf(parameter);
    if (parameter.sensitive) {
      help += std::string(help.empty() ? "" : "\n") + "\"-\" reads it from standard input, without echo.";
    }
    if (!help.empty()) text += std::string(10, ' ') + Wrap(help, 10, screen) + '\n';
  }
  return text;
}

/// Two columns, the second wrapped.
std::string ListText(const std::vector<std::pair<std::string, std::string>>& rows, std::size_t screen) {
  std::size_t width = 0;
  for (const auto& row : rows) width = std::max(width, DisplayWidth(row.first));
  std::string text;
  for (const auto& [name, help] : rows) {
    text += "  " + name;
    if (!help.empty())
      text += std::string(width + 2 - DisplayWidth(name), ' ') + Wrap(help, width + 4, screen);
    text += '\n';
  }
  return text;
}

std::string Program(const std::string& path) { return path.empty() ? "hcli" : "hcli " + path; }

std::string Description(const NodeData& data, std::size_t screen) {
  return data.description.empty() ? "" : Wrap(data.description, 0, screen) + "\n\n";
}

std::string NamespaceHelp(const AutoCli::NamespaceNode& node, const std::string& path, std::size_t screen) {
  const NodeData& data = NodeData::Of(node);
  std::string text = path.empty() ? "Usage: hcli [GLOBAL OPTIONS] COMMAND... [OPTIONS]\n\n"
                                  : "Usage: " + Program(path) + " COMMAND... [OPTIONS]\n\n";
  text += Description(data, screen);
  std::vector<std::pair<std::string, std::string>> rows;
  for (const Child& child : data.children) {
    rows.emplace_back(Visible(child.name), NodeData::Of(*child.node).description);
  }
  text += rows.empty() ? "There are no commands here.\n" : "Commands:\n" + ListText(rows, screen);
  if (path.empty()) text += "\nGlobal options:\n" + OptionsText(GlobalParameters(), screen);
  return text;
}

std::string ResultText(AutoCli::Command& command, std::size_t screen) {
  const auto prototype = PrototypeOf(*command.GetOutputSpec());
  if (!prototype) return "";
  const std::string kind = TypeName(prototype->GetType());
  const MetaObj::MetaStruct* structure = StructureOf(*prototype);
  if (!structure || structure->GetFieldCount() == 0) return "\nResult: " + kind + '\n';
  std::vector<std::pair<std::string, std::string>> rows;
  for (std::size_t index = 0; index < structure->GetFieldCount(); ++index) {
    rows.emplace_back(structure->GetFieldName(index), TypeName(structure->GetField(index)->GetType()));
  }
  return "\nResult: " + kind + " with the fields\n" + ListText(rows, screen);
}

std::string CommandHelp(AutoCli::Command& command, const std::string& path, std::size_t screen) {
  const std::vector<Parameter> parameters = ParametersOf(*command.GetInputSpec());
  std::string usage = "Usage: " + Program(path);
  std::size_t column = DisplayWidth(usage);
  const auto add = [&](const std::string& part) {
    if (column + part.size() > screen) {
      usage += "\n      ";  // the part begins with a blank
      column = 6;
    }
    usage += part;
    column += part.size();
  };
  bool optional = false;
  for (const Parameter& parameter : parameters) {
    optional = optional || !parameter.required;
    if (!parameter.required) continue;
    const bool operand = MayBeOperand(parameter);
    add((operand ? " [--" : " --") + parameter.name + (operand ? "]" : "") + Placeholder(parameter));
  }
  if (optional) add(" [OPTIONS]");
  std::string text = usage + "\n\n" + Description(NodeData::Of(command), screen);
  if (!parameters.empty()) text += "Options:\n" + OptionsText(parameters, screen) + '\n';
  text += "hcli --help lists the global options.\n";
  return text + ResultText(command, screen);
}

}  // namespace

std::string HelpText(AutoCli::NamespaceNode& node, const std::string& path, std::size_t screen) {
  if (!NodeData::Of(node).isCommand) return NamespaceHelp(node, path, screen);
  return CommandHelp(dynamic_cast<AutoCli::Command&>(node), path, screen);
}

}  // namespace Plinth
