/// What commands declare, as the framework reads it: the nodes of the tree, parameters and results.
#pragma once

#include <Plinth/AutoCli.h>
#include <Plinth/CallSpec.h>
#include <Plinth/MetaObj.h>

#include <boost/shared_ptr.hpp>
#include <string>
#include <utility>
#include <vector>

#pragma GCC visibility push(default)

namespace Plinth {

/// Settings in the order in which their keys were first set.
using KeyValues = std::vector<std::pair<std::string, std::string>>;

/// The value of @p key, or null.
const std::string* FindValue(const KeyValues& settings, const std::string& key);

/// A value that an enumerated parameter allows.
struct AllowedValue {
  std::string value;
  std::string help;
};

/// One declared parameter.
struct Parameter {
  std::string name;
  CallSpec::ParameterType type = CallSpec::ParameterType::String;
  /// One letter, or empty.
  std::string shortName;
  /// Raw, with "%ENUM%".
  std::string help;
  bool required = false;
  bool sensitive = false;
  /// Empty where any value goes.
  std::vector<AllowedValue> allowed;
};

std::vector<std::string> AllowedValues(const Parameter& parameter);
/// True where the value may stand on the command line without the option's name.
bool MayBeOperand(const Parameter& parameter);

/// The declared parameters in order.
std::vector<Parameter> ParametersOf(const CallSpec::InputSpec& spec);
/// The declared prototype; null where none was set.
boost::shared_ptr<MetaObj::MetaObject> PrototypeOf(const CallSpec::OutputSpec& spec);

/// The structure that a result (or prototype) consists of: itself or the prototype of its elements. Null
/// for other results.
const MetaObj::MetaStruct* StructureOf(const MetaObj::MetaObject& object);
/// The names of the structure's fields in order.
std::vector<std::string> FieldNames(const MetaObj::MetaStruct& structure);

/// "string", "int", "bool", "flag" or "list".
const char* TypeName(CallSpec::ParameterType type);
/// "bool", "int", "string", "struct" or "list".
const char* TypeName(MetaObj::MetaType type);

}  // namespace Plinth

namespace Plinth::AutoCli {

struct Child {
  std::string name;
  boost::shared_ptr<NamespaceNode> node;
};

/// What the framework keeps of a node of the tree.
struct NodeData {
  std::string description;
  /// Right under the root: the name of the plug-in's file without its ending. Empty for what no file brought.
  std::string plugin;
  std::vector<Child> children;
  bool isCommand = false;
  /// Empty where the command names no formatter.
  std::string formatter;
  KeyValues formatterParameters;
  KeyValues metaData;

  static NodeData& Of(NamespaceNode& node);
  static const NodeData& Of(const NamespaceNode& node);
  /// The node's child of that name, or null.
  static NamespaceNode* FindChild(const NamespaceNode& node, const std::string& name);
  static std::vector<std::string> ChildNames(const NamespaceNode& node);
};

}  // namespace Plinth::AutoCli

#pragma GCC visibility pop
