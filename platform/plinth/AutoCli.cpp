#include <Plinth/AutoCli.h>

#include <stdexcept>
#include <utility>

#include "plinth/Declarations.h"
#include "plinth/Text.h"

namespace Plinth::AutoCli {

NodeData& NodeData::Of(NamespaceNode& node) { return *node.data_; }
const NodeData& NodeData::Of(const NamespaceNode& node) { return *node.data_; }

NamespaceNode* NodeData::FindChild(const NamespaceNode& node, const std::string& name) {
  for (const Child& child : Of(node).children) {
    if (child.name == name) return child.node.get();
  }
  return nullptr;
}

std::vector<std::string> NodeData::ChildNames(const NamespaceNode& node) {
  std::vector<std::string> names;
  for (const Child& child : Of(node).children) names.push_back(child.name);
  return names;
}

NamespaceNode::NamespaceNode() : data_(std::make_unique<NodeData>()) {}
NamespaceNode::~NamespaceNode() = default;

void NamespaceNode::SetDescription(const std::string& text) { data_->description = text; }

void NamespaceNode::RegisterNamespaceNode(boost::shared_ptr<NamespaceNode> child, const std::string& name) {
  if (!child) throw std::logic_error("no node is given to register as " + Quoted(name));
  if (name.empty()) throw std::logic_error("a node needs a name to be registered under");
  if (data_->isCommand) throw std::logic_error(Quoted(name) + " cannot be registered under a command");
  if (NodeData::FindChild(*this, name)) throw std::logic_error("the name " + Quoted(name) + " is taken");
  data_->children.push_back({name, std::move(child)});
}

boost::shared_ptr<Namespace> Namespace::New() { return boost::shared_ptr<Namespace>(new Namespace); }
Namespace::Namespace() = default;
Namespace::~Namespace() = default;

namespace {

void SetValue(KeyValues& settings, const std::string& key, const std::string& value) {
  for (auto& setting : settings) {
    if (setting.first != key) continue;
    setting.second = value;
    return;
  }
  settings.emplace_back(key, value);
}

}  // namespace

Command::Command() { NodeData::Of(*this).isCommand = true; }
Command::~Command() = default;

boost::shared_ptr<CallSpec::InputSpec> Command::GetInputSpec() {
  auto spec = GetInputSpecInternal();
  if (!spec) throw std::logic_error("a command declares no InputSpec");
  return spec;
}

boost::shared_ptr<CallSpec::OutputSpec> Command::GetOutputSpec() {
  auto spec = GetOutputSpecInternal();
  if (!spec) throw std::logic_error("a command declares no OutputSpec");
  return spec;
}

void Command::Execute(boost::shared_ptr<CallSpec::Input> input, boost::shared_ptr<CallSpec::Output> output) {
  ExecuteInternal(std::move(input), std::move(output));
}

void Command::SetDefaultOutputFormatter(const std::string& name) { NodeData::Of(*this).formatter = name; }

void Command::SetDefaultOutputParameter(const std::string& key, const std::string& value) {
  SetValue(NodeData::Of(*this).formatterParameters, key, value);
}

void Command::SetMetaDataField(const std::string& key, const std::string& value) {
  SetValue(NodeData::Of(*this).metaData, key, value);
}

}  // namespace Plinth::AutoCli
