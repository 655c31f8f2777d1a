#include "doctor/Doctor.h"

#include <Plinth/ChangeGroup.h>
#include <Plinth/MetaObj.h>
#include <Plinth/Rehearsal.h>

#include <algorithm>
#include <string_view>

#include "doctor/Bundle.h"

extern char** environ;

namespace TessaroCli::Doctor {

namespace {

namespace CallSpec = Plinth::CallSpec;
namespace MetaObj = Plinth::MetaObj;
using Plinth::CheckSource;
using Plinth::CheckSources;
using Plinth::Finding;
using Plinth::FindingState;
using Plinth::Variable;

/// Asks each source, and those that become known by that.
template <class Ask>
void ForEachSource(Ask ask) {
  for (std::size_t index = 0; index < CheckSources().size(); ++index) ask(*CheckSources()[index]);
}

std::vector<Variable> KnownVariables() {
  std::vector<Variable> known;
  ForEachSource([&](CheckSource& source) {
    for (Variable& variable : source.Variables()) known.push_back(std::move(variable));
  });
  return known;
}

/// Returns the variables of hcli that are set, a line each. Nobody knows what the value of another one is: it
/// may be a secret.
std::string CheckVariables(std::vector<Finding>& findings) {
  const std::vector<Variable> known = KnownVariables();
  const std::size_t before = findings.size();
  std::string set;
  for (char** entry = environ; *entry != nullptr; ++entry) {
    const std::string variable = *entry;
    if (!variable.starts_with("HCLI_")) continue;
    const std::size_t end = variable.find('=');
    const std::string name = variable.substr(0, end);
    const auto found =
        std::find_if(known.begin(), known.end(), [&](const Variable& one) { return one.name == name; });
    if (found == known.end()) {
      findings.push_back({"variable " + name, FindingState::Warning,
                          "No part of hcli that could be loaded reads it.", "unset " + name});
      set += name + " is set\n";
      continue;
    }
    set += variable + '\n';
    if (end + 1 >= variable.size() && !found->mayBeEmpty) {
      findings.push_back({"variable " + name, FindingState::Fault, "It is set, and empty.", "unset " + name});
    }
  }
  if (findings.size() == before) {
    findings.push_back({"variables", FindingState::Ok, "Those of hcli that are set make sense.", ""});
  }
  return set;
}

boost::shared_ptr<MetaObj::MetaStruct> Row(const Finding& finding) {
  auto row = MetaObj::MetaStruct::New("Finding");
  row->SetField("State", WordOf(finding.state));
  row->SetField("Check", finding.check);
  row->SetField("Seen", finding.seen);
  row->SetField("Mend", finding.mend);
  return row;
}

class DoctorCommand final : public Plinth::AutoCli::Command {
 public:
  DoctorCommand() {
    SetDescription("Look at all that hcli needs: what is wrong, and what mends it.");
    SetMetaDataField("type", "operation");  // it can write a file
    SetMetaDataField("dry-run", "heeded");
    SetDefaultOutputFormatter("simple");
    SetDefaultOutputParameter("header:Finding", "%State%: %Check%: %Seen%");
    SetDefaultOutputParameter("fields:Finding", "State,Check,Seen,Mend");
    SetDefaultOutputParameter("dense:Finding", "Mend");
  }

 private:
  boost::shared_ptr<CallSpec::InputSpec> GetInputSpecInternal() override {
    auto spec = CallSpec::InputSpec::New();
    auto parameter = CallSpec::ParameterSpec::New("bundle", CallSpec::ParameterType::String);
    parameter->SetHelp("A new file for a report to somebody who is to help; it has no secrets.");
    spec->AddParameter(parameter);
    return spec;
  }

  static boost::shared_ptr<MetaObj::MetaList> NewList() {
    return MetaObj::MetaList::New(MetaObj::MetaType::Struct, Row({}));
  }

  boost::shared_ptr<CallSpec::OutputSpec> GetOutputSpecInternal() override {
    auto spec = CallSpec::OutputSpec::New();
    spec->SetResultType(NewList());
    return spec;
  }

  void ExecuteInternal(boost::shared_ptr<CallSpec::Input> input,
                       boost::shared_ptr<CallSpec::Output> output) override {
    Plinth::SettleChanges();  // the host's files are to be seen as they stand between changes
    std::vector<Finding> findings;
    ForEachSource([&](CheckSource& source) {
      for (Finding& finding : source.Check()) findings.push_back(std::move(finding));
    });
    const std::string variables = CheckVariables(findings);
    std::stable_sort(findings.begin(), findings.end(),
                     [](const Finding& one, const Finding& other) { return one.state > other.state; });
    const auto faults = std::count_if(findings.begin(), findings.end(), [](const Finding& finding) {
      return finding.state == FindingState::Fault;
    });
    if (faults > 0) {
      output->ReportError(faults == 1 ? "1 fault was found."
                                      : std::to_string(faults) + " faults were found.");
    }
    if (input->HasParameter("bundle")) Enclose(input->GetString("bundle"), variables, findings, *output);
    auto list = NewList();
    for (const Finding& finding : findings) list->Append(Row(finding));
    output->SetResult(list);
    output->Close();
  }

  /// Writes the report, and adds a finding that says so.
  static void Enclose(const std::string& path, const std::string& variables, std::vector<Finding>& findings,
                      CallSpec::Output& output) {
    std::vector<Plinth::Enclosure> enclosures;
    ForEachSource([&](CheckSource& source) {
      for (Plinth::Enclosure& enclosure : source.Describe()) enclosures.push_back(std::move(enclosure));
    });
    enclosures.push_back({"variables", variables});
    const std::string failure = WriteBundle(path, BundleText(findings, enclosures));
    if (!failure.empty()) return output.ReportError(failure);
    std::string seen = path + (Plinth::IsRehearsing() ? " would have" : " has") + " the findings";
    for (const Plinth::Enclosure& enclosure : enclosures) seen += ", " + enclosure.name;
    findings.push_back({"report", FindingState::Ok, seen + "; no secrets.", ""});
  }
};

}  // namespace

boost::shared_ptr<Plinth::AutoCli::NamespaceNode> NewDoctor() {
  return boost::shared_ptr<Plinth::AutoCli::NamespaceNode>(new DoctorCommand);
}

}  // namespace TessaroCli::Doctor
