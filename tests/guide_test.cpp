/// The guides name what is there, and tell where they are wrong.

#include "plinth/Guide.h"

#include <fstream>
#include <set>

#include "doctor/Doctor.h"
#include "linux/Commands.h"
#include "plinth/Declarations.h"
#include "plinth/GlobalOptions.h"
#include "plinth/OwnCommands.h"
#include "simulator/Commands.h"
#include "status/Status.h"
#include "support/Harness.h"
#include "support/ProjectFile.h"

namespace Plinth::Test {
namespace {

using Names = std::set<std::string>;

/// What is declared under a root.
struct Declared {
  explicit Declared(const AutoCli::NamespaceNode& root) {
    for (const Parameter& parameter : GlobalParameters()) options[""].insert(parameter.name);
    WalkTree(root, "", [&](const std::string& path, AutoCli::NamespaceNode& node) {
      options[path];
      auto* const command = dynamic_cast<AutoCli::Command*>(&node);
      if (!command) return;
      for (const Parameter& parameter : ParametersOf(*command->GetInputSpec())) {
        options[path].insert(parameter.name);
        for (std::size_t at = path.rfind(' '); at != path.npos; at = path.rfind(' ', at - 1)) {
          options[path.substr(0, at)].insert(parameter.name);
        }
        options[""].insert(parameter.name);
      }
      const std::string* const type = FindValue(AutoCli::NodeData::Of(node).metaData, "type");
      if (type && *type == "fetcher") fetchers.insert(path);
      const auto prototype = PrototypeOf(*command->GetOutputSpec());
      const MetaObj::MetaStruct* const row = StructureOf(*prototype);
      if (!row) return;
      for (const std::string& name : FieldNames(*row)) {
        fields[path].insert(name);
        structures[row->GetTypeName()].insert(name);
      }
    });
  }

  std::map<std::string, Names> options;  ///< of a command or of what is in a namespace
  std::map<std::string, Names> fields;   ///< of a command's result
  std::map<std::string, Names> structures;
  Names fetchers;
};

void ExpectKnown(const Guide& guide, const Declared& declared) {
  for (const ValueSource& source : guide.values) {
    SCOPED_TRACE(source.option + " of " + source.of);
    EXPECT_TRUE(declared.options.contains(source.of));
    EXPECT_TRUE(declared.options.at(source.of).contains(source.option));
    if (source.kind != ValueSource::Kind::Shown) continue;
    EXPECT_TRUE(declared.fetchers.contains(source.from)) << source.from << " is no command that only reads";
    const Names& fields = declared.fields.at(source.from);
    EXPECT_TRUE(fields.contains(source.field)) << source.field;
    EXPECT_TRUE(source.about.empty() || fields.contains(source.about)) << source.about;
    for (const std::string& option : source.with) {
      EXPECT_TRUE(declared.options.at(source.from).contains(option)) << option;
    }
  }
  for (const auto& [path, examples] : guide.examples) EXPECT_TRUE(declared.options.contains(path)) << path;
  for (const auto& [path, result] : guide.results) EXPECT_TRUE(declared.options.contains(path)) << path;
  for (const auto& [structure, meanings] : guide.fields) {
    for (const auto& [field, meaning] : meanings) {
      const auto known = declared.structures.find(structure);
      EXPECT_TRUE(known != declared.structures.end() && known->second.contains(field))
          << structure << '.' << field;
    }
  }
}

TEST(Guide, NamesWhatIsThere) {
  const auto others = AutoCli::Namespace::New();
  others->RegisterNamespaceNode(simulator::NewNamespace(), "simulator");
  others->RegisterNamespaceNode(linux::NewNamespace(), "linux");
  others->RegisterNamespaceNode(TessaroCli::Status::NewStatus(), "status");
  others->RegisterNamespaceNode(TessaroCli::Doctor::NewDoctor(), "doctor");
  const std::pair<const char*, Declared> cases[] = {
      {"plugins/iscsi", Declared(CommandTree())}, {"platform/plinth", Declared(CommandTree())},
      {"platform/linux", Declared(*others)},      {"platform/simulator", Declared(*others)},
      {"plugins/status", Declared(*others)},      {"plugins/doctor", Declared(*others)},
  };
  std::map<std::string, std::map<std::string, std::string>> meanings;
  std::map<std::string, Names> structures;
  for (const auto& [folder, declared] : cases) {
    const Guide guide = ReadGuide(ProjectFile(std::string(folder) + "/guide.yaml"));
    ExpectKnown(guide, declared);
    for (const auto& [structure, fields] : guide.fields)
      meanings[structure].insert(fields.begin(), fields.end());
    structures.insert(declared.structures.begin(), declared.structures.end());
  }
  for (const auto& [structure, fields] : structures) {
    for (const std::string& field : fields) {
      EXPECT_TRUE(meanings[structure].contains(field)) << structure << '.' << field << " has no meaning";
    }
  }
}

TEST(Guide, IsAboutTheNearestPlace) {
  const Guide guide = ReadGuide(ProjectFile("plugins/iscsi/guide.yaml"));
  const std::tuple<const char*, const char*, std::string> cases[] = {
      {"iscsi session list", "name", "iscsi adapter target list"},
      {"iscsi session remove", "name", "iscsi session list"},
      {"iscsi software set", "name", ""},
      {"iscsi sessions list", "isid", ""},
  };
  for (const auto& [path, option, from] : cases) {
    const ValueSource* const source = guide.FindValues(path, option);
    EXPECT_EQ(source ? source->from : "", from) << path;
  }
}

TEST(Guide, SaysWhereItIsWrong) {
  const TemporaryRoot root;
  const std::string file = root.Path() + "/wrong.yaml";
  const std::pair<const char*, const char*> cases[] = {
      {"fields:\n  A: {B: c\n", "3: did not find expected ',' or '}'"},
      {"\nexamples: {}",
       R"(2: there is no key "examples" here; there are values, commands, fields, terms, environment and files)"},
      {"fields: {A: {B: c,\n B: d}}", R"(2: "B" stands here twice)"},
      {"fields: {A: {B: }}", "1: a text has to stand here"},
      {"values:\n- option: a\n", "2: either from and field, or kind, has to stand here"},
      {"values:\n- {option: a, kind: pipe}",
       R"(2: the kind "pipe" is none; there are file, folder and command)"},
      {"commands:\n  a:\n    examples:\n    - line: b", "4: an example has about and line"},
      {"values: {}", "1: a list has to stand here"},
      {"fields: {}\n---\nterms: {}", "2: a second document begins here; a guide is a single one"},
      {"fields: {}\n...\nterms: {}", "3: did not find expected <document start>"},
      {"values:\n- {option: a, kind: file}\n- {option: a, kind: file}",
       "3: the values of \"a\" stand here twice for the same place"},
      {"[]", "1: names with values have to stand here"},
  };
  for (const auto& [text, problem] : cases) {
    std::ofstream(file) << text;
    try {
      ReadGuide(file);
      ADD_FAILURE() << text;
    } catch (const GuideError& error) {
      EXPECT_EQ(error.what(), file + ':' + problem);
    }
  }
  EXPECT_THROW(ReadGuide(root.Path() + "/none.yaml"), GuideError);
}

}  // namespace
}  // namespace Plinth::Test
