#include "status/Status.h"

#include <Plinth/MetaObj.h>

#include "status/Findings.h"

namespace TessaroCli::Status {

namespace {

namespace CallSpec = Plinth::CallSpec;
namespace MetaObj = Plinth::MetaObj;

constexpr const char* kStates[] = {"ok", "warning", "fault"};

boost::shared_ptr<MetaObj::MetaStruct> Row(const Line& line) {
  auto row = MetaObj::MetaStruct::New("HostStatus");
  row->SetField("State", kStates[static_cast<int>(line.state)]);
  row->SetField("Where", line.where);
  row->SetField("Kind", line.kind);
  row->SetField("Count", static_cast<long long>(line.count));
  row->SetField("Finding", line.finding);
  row->SetField("Detail", line.detail);
  row->SetField("Targets", line.targets);
  row->SetField("Look Closer", line.closer);
  return row;
}

class StatusCommand final : public Plinth::AutoCli::Command {
 public:
  StatusCommand() {
    SetDescription("Show how the host's storage stands, faults first.");
    SetMetaDataField("type", "fetcher");
    SetDefaultOutputFormatter("simple");
    SetDefaultOutputParameter("header:HostStatus", "%State%: %Where%: %Finding%");
    SetDefaultOutputParameter("fields:HostStatus", "State,Where,Finding,Detail,Targets,Look Closer");
    SetDefaultOutputParameter("dense:HostStatus", "Look Closer");
  }

 private:
  boost::shared_ptr<CallSpec::InputSpec> GetInputSpecInternal() override {
    return CallSpec::InputSpec::New();
  }

  static boost::shared_ptr<MetaObj::MetaList> NewList() {
    return MetaObj::MetaList::New(MetaObj::MetaType::Struct, Row(Line()));
  }

  boost::shared_ptr<CallSpec::OutputSpec> GetOutputSpecInternal() override {
    auto spec = CallSpec::OutputSpec::New();
    spec->SetResultType(NewList());
    return spec;
  }

  void ExecuteInternal(boost::shared_ptr<CallSpec::Input>,
                       boost::shared_ptr<CallSpec::Output> output) override {
    const auto surveys = SurveyHost([&](const std::string& text) { output->ReportError(text); });
    std::vector<Plinth::Finding> waiting;
    if (surveys) {
      for (Plinth::CheckSource* source : Plinth::CheckSources()) {
        for (Plinth::Finding& finding : source->Waiting()) waiting.push_back(std::move(finding));
      }
    }
    auto list = NewList();
    for (const Line& line : LinesOf(surveys, waiting)) list->Append(Row(line));
    output->SetResult(list);
    output->Close();
  }
};

}  // namespace

boost::shared_ptr<Plinth::AutoCli::NamespaceNode> NewStatus() {
  return boost::shared_ptr<Plinth::AutoCli::NamespaceNode>(new StatusCommand);
}

}  // namespace TessaroCli::Status
