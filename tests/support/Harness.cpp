#include "support/Harness.h"

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>

#include "host/Host.h"
#include "ima/Memory.h"
#include "plinth/Declarations.h"
#include "plinth/Formatter.h"
#include "plinth/OwnCommands.h"
#include "simulator/Simulator.h"
#include "support/ProjectFile.h"
#include "support/Words.h"

extern "C" void AutoCli_RegisterNamespaces(boost::shared_ptr<Plinth::AutoCli::Namespace> parent);

namespace {

using nlohmann::json;
using namespace Plinth::MetaObj;

template <class Scalar>
json ValueOf(const MetaObject& object) {
  const auto& scalar = dynamic_cast<const Scalar&>(object);
  return scalar.HasValue() ? json(scalar.GetValue()) : json();
}

json ToJson(const MetaObject& object) {
  switch (object.GetType()) {
    case MetaType::Bool:
      return ValueOf<MetaBool>(object);
    case MetaType::Int:
      return ValueOf<MetaInt>(object);
    case MetaType::String:
      return ValueOf<MetaString>(object);
    case MetaType::Struct: {
      json fields = json::object();
      const auto& structure = dynamic_cast<const MetaStruct&>(object);
      for (std::size_t i = 0; i < structure.GetFieldCount(); ++i) {
        fields[structure.GetFieldName(i)] = ToJson(*structure.GetField(i));
      }
      return fields;
    }
    case MetaType::List: {
      json elements = json::array();
      Plinth::ForEachElement(object, [&](const MetaObject& element) { elements.push_back(ToJson(element)); });
      return elements;
    }
  }
  return {};
}

}  // namespace

std::vector<std::string> Outcome::Calls() const {
  std::vector<std::string> names;
  for (const std::string& line : trace) names.push_back(line.substr(0, line.find('(')));
  return names;
}

std::vector<std::string> Outcome::Column(const char* field) const {
  std::vector<std::string> values;
  for (const json& row : result) values.push_back(row.at(field));
  return values;
}

std::string WithAnswers(const std::string& description, const std::string& answers) {
  json host = json::parse(description);
  for (json& answer : json::parse('[' + answers + ']')) host["answers"].push_back(std::move(answer));
  return host.dump();
}

Plinth::AutoCli::Namespace& CommandTree() {
  static const auto root = [] {
    auto made = Plinth::AutoCli::Namespace::New();
    AutoCli_RegisterNamespaces(made);
    Plinth::RegisterOwnCommands(*made);
    return made;
  }();
  return *root;
}

Harness::Harness(const std::string& description) {
  host::Host::Use(simulator::HostOf(description));
  host::SetTraceSink([this](const std::string& line) { trace.push_back(line); });
}

Harness::~Harness() {
  host::SetTraceSink(nullptr);
  host::Host::Use(nullptr);
}

Outcome Harness::operator()(const std::string& line) { return (*this)(SplitWords(line)); }

Outcome Harness::operator()(const std::vector<std::string>& words) {
  Plinth::TextConsole console;
  console.input = input;
  trace.clear();
  Plinth::RunRecord record = Plinth::RunCommandLine(CommandTree(), words, console, {.checked = true});
  return Finish(std::move(record), console);
}

Outcome Harness::operator()(const boost::shared_ptr<Plinth::AutoCli::NamespaceNode>& command,
                            const std::string& options) {
  Plinth::TextConsole console;
  console.input = input;
  trace.clear();
  auto& runnable = dynamic_cast<Plinth::AutoCli::Command&>(*command);
  return Finish(Plinth::RunCommand(runnable, SplitWords(options), console, {.checked = true}), console);
}

Outcome Harness::Finish(Plinth::RunRecord record, Plinth::TextConsole& console) {
  EXPECT_EQ(ima::OutstandingAllocations(), 0u) << "memory of the management API is kept";
  Outcome run;
  run.status = record.status;
  run.messages = std::move(record.messages);
  run.reasons = std::move(record.reasons);
  run.notes = std::move(record.notes);
  if (record.result) run.result = ToJson(*record.result);
  run.closed = record.closed;
  run.failure = std::move(record.failure);
  run.trace = trace;
  run.out = std::move(console.out.text);
  run.err = std::move(console.error.text);
  return run;
}

json Harness::Show() const { return json::parse(simulator::Show(true)); }

json Harness::Show(const std::string& pointer) const { return Show().at(json::json_pointer(pointer)); }

void ExpectFile(const std::string& name, const std::string& text) {
  if (std::getenv("UPDATE_GOLDEN") != nullptr) std::ofstream(ProjectFile(name)) << text;
  const std::string kept = FileText(name);
  const auto at = std::mismatch(kept.begin(), kept.end(), text.begin(), text.end()).first - kept.begin();
  const std::size_t from = std::min(kept.rfind("\n\n", static_cast<std::size_t>(at)), text.size());
  const auto part = [&](const std::string& all) { return all.substr(std::min(from, all.size()), 1500); };
  EXPECT_TRUE(kept == text) << name << " has\n"
                            << part(kept) << "\nnow it is\n"
                            << part(text) << "\nIf that is meant, UPDATE_GOLDEN=1 writes the file anew.";
}

TemporaryRoot::TemporaryRoot() {
  std::string name = (std::filesystem::temp_directory_path() / "hcli-test-XXXXXX").string();
  if (mkdtemp(name.data()) == nullptr) throw std::runtime_error("no temporary folder " + name);
  path_ = name;
  const char* before = std::getenv("HCLI_ROOT");
  if (before != nullptr) before_ = before;
  setenv("HCLI_ROOT", path_.c_str(), 1);
}

TemporaryRoot::~TemporaryRoot() {
  if (before_.empty()) unsetenv("HCLI_ROOT");
  if (!before_.empty()) setenv("HCLI_ROOT", before_.c_str(), 1);
  std::error_code ignored;
  std::filesystem::remove_all(path_, ignored);
}

std::string TemporaryRoot::Read(const std::string& file) const {
  std::ifstream stream(path_ + '/' + file);
  return {std::istreambuf_iterator<char>(stream), {}};
}
