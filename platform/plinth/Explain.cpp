#include <set>

#include "plinth/Guide.h"
#include "plinth/OwnCommands.h"
#include "plinth/Text.h"

namespace Plinth {

namespace {

using MetaObj::MetaList;
using MetaObj::MetaStruct;
using MetaObj::MetaType;

constexpr const char* kWord = "word";

/// Finds what is meant, and makes a row of each part of it.
class Explanation {
 public:
  Explanation(AutoCli::Namespace& root, const std::string& wanted)
      : root_(root),
        wanted_(wanted),
        structure_(wanted.substr(0, wanted.find('.'))),
        field_(structure_ == wanted ? "" : wanted.substr(structure_.size() + 1)) {
    WalkTree(root, "", [&](const std::string& path, AutoCli::NamespaceNode& node) {
      auto* const command = dynamic_cast<AutoCli::Command*>(&node);
      if (command) AddCommand(path, *command);
      isNamespace_ = isNamespace_ || (!command && path == wanted);
      if (path.find(' ') == path.npos) AddTerms(GuideTo(root, path));
    });
  }

  static boost::shared_ptr<MetaList> NewRows() {
    return MetaList::New(MetaType::Struct, Row("", "", "", "", ""));
  }

  /// Empty where nothing of that name is known.
  boost::shared_ptr<MetaList> Rows() const { return rows_; }
  /// What to ask instead.
  std::string Advice() const {
    if (isNamespace_) return "\"hcli help " + wanted_ + "\" lists the commands there";
    const std::string nearest = Nearest(structure_, names_);
    return nearest.empty() ? "\"hcli catalogue\" lists the commands"
                           : "did you mean " + Quoted(nearest) + '?';
  }

 private:
  static boost::shared_ptr<MetaStruct> Row(const std::string& name, const std::string& structure,
                                           const std::string& field, const std::string& type,
                                           const std::string& meaning) {
    auto row = MetaStruct::New("FieldMeaning");
    row->SetField("Name", name);
    row->SetField("Structure", structure);
    row->SetField("Field", field);
    row->SetField("Type", type);
    row->SetField("Meaning", meaning);
    return row;
  }

  /// Several commands may show a structure, and each of them other fields of it.
  void AddCommand(const std::string& path, AutoCli::Command& command) {
    const auto prototype = PrototypeOf(*command.GetOutputSpec());
    const MetaStruct* const structure = prototype ? StructureOf(*prototype) : nullptr;
    names_.push_back(path);
    if (!structure || structure->GetFieldCount() == 0) {
      if (path != wanted_ || !prototype) return;
      return rows_->Append(
          Row(path, "", "", TypeName(prototype->GetType()), GuideTo(root_, path).ResultOf(path)));
    }
    const std::string& type = structure->GetTypeName();
    names_.push_back(type);
    if (path != wanted_ && type != structure_) return;
    for (std::size_t index = 0; index < structure->GetFieldCount(); ++index) {
      const std::string& field = structure->GetFieldName(index);
      const bool isMeant = path == wanted_ || field_.empty() || field == field_;
      if (!isMeant || !known_.insert(field).second) continue;
      rows_->Append(Row(type + '.' + field, type, field, TypeName(structure->GetField(index)->GetType()),
                        GuideTo(root_, path).MeaningOf(type, field)));
    }
  }

  void AddTerms(const Guide& guide) {
    for (const auto& [term, meaning] : guide.terms) {
      names_.push_back(term);
      if (term == wanted_) rows_->Append(Row(term, "", "", "", meaning));
    }
  }

  AutoCli::Namespace& root_;
  std::string wanted_;
  std::string structure_;
  std::string field_;
  boost::shared_ptr<MetaList> rows_ = NewRows();
  std::set<std::string> known_;
  bool isNamespace_ = false;
  std::vector<std::string> names_;
};

class Explain final : public virtual AutoCli::Command {
 public:
  explicit Explain(AutoCli::Namespace& root) : root_(root) {
    SetDescription("Tell what the fields of a command's result mean.");
    SetDefaultOutputParameter("header:FieldMeaning", "%Name%");
    SetDefaultOutputParameter("fields:FieldMeaning", "Type,Meaning");
    SetMetaDataField("type", "fetcher");
  }

 private:
  boost::shared_ptr<CallSpec::InputSpec> GetInputSpecInternal() override {
    auto words = CallSpec::ParameterSpec::New(kWord, CallSpec::ParameterType::StringList);
    words->SetHelp(
        "The words of a command, the name of a structure, one of its fields as in STRUCTURE.FIELD, or "
        "another "
        "word that results show.");
    words->SetRequired(true);
    auto spec = CallSpec::InputSpec::New();
    spec->AddParameter(words);
    return spec;
  }

  boost::shared_ptr<CallSpec::OutputSpec> GetOutputSpecInternal() override {
    auto spec = CallSpec::OutputSpec::New();
    spec->SetResultType(Explanation::NewRows());
    return spec;
  }

  void ExecuteInternal(boost::shared_ptr<CallSpec::Input> input,
                       boost::shared_ptr<CallSpec::Output> output) override {
    std::vector<std::string> words;
    input->GetStringList(kWord, words);
    const std::string wanted = Join(words, " ");
    const Explanation explanation(root_, wanted);
    if (explanation.Rows()->GetSize() == 0) {
      output->ReportError("There is no command, structure, field or word " + Quoted(wanted) + "; " +
                          explanation.Advice());
      return;
    }
    output->SetResult(explanation.Rows());
    output->Close();
  }

  AutoCli::Namespace& root_;
};

}  // namespace

boost::shared_ptr<AutoCli::NamespaceNode> NewExplain(AutoCli::Namespace& root) {
  return boost::shared_ptr<AutoCli::NamespaceNode>(new Explain(root));
}

}  // namespace Plinth
