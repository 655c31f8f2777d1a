#include "plinth/OwnCommands.h"

namespace Plinth {

namespace {

using MetaObj::MetaList;
using MetaObj::MetaObject;
using MetaObj::MetaString;
using MetaObj::MetaStruct;
using MetaObj::MetaType;

boost::shared_ptr<MetaList> NewList() { return MetaList::New(MetaType::Struct, MetaStruct::New("")); }

boost::shared_ptr<MetaStruct> Settings(const KeyValues& settings) {
  auto structure = MetaStruct::New("");
  for (const auto& [key, value] : settings) structure->SetField(key, value);
  return structure;
}

boost::shared_ptr<MetaStruct> Describe(const Parameter& parameter) {
  auto allowed = NewList();
  for (const AllowedValue& value : parameter.allowed) {
    auto structure = MetaStruct::New("");
    structure->SetField("value", value.value);
    structure->SetField("help", value.help);
    allowed->Append(structure);
  }
  auto structure = MetaStruct::New("");
  structure->SetField("name", parameter.name);
  structure->SetField("short", parameter.shortName);
  structure->SetField("type", TypeName(parameter.type));
  structure->SetField("required", parameter.required);
  structure->SetField("sensitive", parameter.sensitive);
  structure->SetField("help", parameter.help);
  structure->SetField("enum", boost::shared_ptr<MetaObject>(allowed));
  return structure;
}

boost::shared_ptr<MetaObject> Describe(const MetaStruct* declared) {
  if (!declared) return MetaString::New();
  auto fields = NewList();
  for (std::size_t index = 0; index < declared->GetFieldCount(); ++index) {
    auto field = MetaStruct::New("");
    field->SetField("name", declared->GetFieldName(index));
    field->SetField("type", TypeName(declared->GetField(index)->GetType()));
    fields->Append(field);
  }
  auto structure = MetaStruct::New("");
  structure->SetField("name", declared->GetTypeName());
  structure->SetField("fields", boost::shared_ptr<MetaObject>(fields));
  return structure;
}

boost::shared_ptr<MetaObject> DescribeResult(const MetaObject* prototype) {
  if (!prototype) return MetaString::New();
  const auto* text = dynamic_cast<const MetaString*>(prototype);
  auto structure = MetaStruct::New("");
  structure->SetField("kind", TypeName(prototype->GetType()));
  structure->SetField("sample", text ? text->GetValue() : "");
  structure->SetField("structure", Describe(StructureOf(*prototype)));
  return structure;
}

/// @p command is null for a namespace.
boost::shared_ptr<MetaStruct> Describe(const std::string& path, const AutoCli::NamespaceNode& node,
                                       AutoCli::Command* command) {
  const AutoCli::NodeData& data = AutoCli::NodeData::Of(node);
  auto structure = MetaStruct::New("CatalogueNode");
  structure->SetField("path", path);
  structure->SetField("kind", command ? "command" : "namespace");
  structure->SetField("description", data.description);
  if (!command) return structure;
  auto parameters = NewList();
  for (const Parameter& parameter : ParametersOf(*command->GetInputSpec())) {
    parameters->Append(Describe(parameter));
  }
  const auto prototype = PrototypeOf(*command->GetOutputSpec());
  structure->SetField("metadata", boost::shared_ptr<MetaObject>(Settings(data.metaData)));
  structure->SetField(
      "formatter", boost::shared_ptr<MetaObject>(data.formatter.empty() ? MetaString::New()
                                                                        : MetaString::New(data.formatter)));
  structure->SetField("formatterParameters",
                      boost::shared_ptr<MetaObject>(Settings(data.formatterParameters)));
  structure->SetField("parameters", boost::shared_ptr<MetaObject>(parameters));
  structure->SetField("result", DescribeResult(prototype.get()));
  return structure;
}

class Catalogue final : public virtual AutoCli::Command {
 public:
  explicit Catalogue(AutoCli::Namespace& root) : root_(root) {
    SetDescription("List every command, with what it takes and gives.");
    SetDefaultOutputFormatter("table");
    SetDefaultOutputParameter("fields:CatalogueNode", "path,kind,description");
    SetMetaDataField("type", "fetcher");
  }

 private:
  boost::shared_ptr<CallSpec::InputSpec> GetInputSpecInternal() override {
    return CallSpec::InputSpec::New();
  }

  /// Open: a namespace has fewer fields than a command.
  static boost::shared_ptr<MetaList> NewNodeList() {
    return MetaList::New(MetaType::Struct, MetaStruct::New("CatalogueNode"));
  }

  boost::shared_ptr<CallSpec::OutputSpec> GetOutputSpecInternal() override {
    auto spec = CallSpec::OutputSpec::New();
    spec->SetResultType(NewNodeList());
    return spec;
  }

  void ExecuteInternal(boost::shared_ptr<CallSpec::Input>,
                       boost::shared_ptr<CallSpec::Output> output) override {
    auto nodes = NewNodeList();
    WalkTree(root_, "", [&](const std::string& path, AutoCli::NamespaceNode& node) {
      nodes->Append(Describe(path, node, dynamic_cast<AutoCli::Command*>(&node)));
    });
    output->SetResult(nodes);
    output->Close();
  }

  AutoCli::Namespace& root_;
};

}  // namespace

boost::shared_ptr<AutoCli::NamespaceNode> NewCatalogue(AutoCli::Namespace& root) {
  return boost::shared_ptr<AutoCli::NamespaceNode>(new Catalogue(root));
}

}  // namespace Plinth
