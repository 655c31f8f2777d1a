#include "linux/Commands.h"

#include <algorithm>
#include <string>

#include "linux/Check.h"

namespace linux {

namespace {

namespace AutoCli = Plinth::AutoCli;
namespace CallSpec = Plinth::CallSpec;
namespace MetaObj = Plinth::MetaObj;

class LinuxCheck final : public AutoCli::Command {
 public:
  LinuxCheck() {
    SetDescription(
        "Tell what this machine has of what its own iSCSI initiator needs, and what mends the rest.");
    SetMetaDataField("type", "fetcher");
    SetDefaultOutputFormatter("table");
  }

 private:
  static boost::shared_ptr<MetaObj::MetaStruct> Row(const Finding& finding) {
    auto row = MetaObj::MetaStruct::New("LinuxCheck");
    row->SetField("Part", finding.part);
    row->SetField("State", finding.isThere ? "ok" : "missing");
    row->SetField("Found", finding.found);
    row->SetField("Mend", finding.mend);
    return row;
  }

  static boost::shared_ptr<MetaObj::MetaList> NewList() {
    return MetaObj::MetaList::New(MetaObj::MetaType::Struct, Row({}));
  }

  boost::shared_ptr<CallSpec::InputSpec> GetInputSpecInternal() override {
    return CallSpec::InputSpec::New();
  }

  boost::shared_ptr<CallSpec::OutputSpec> GetOutputSpecInternal() override {
    auto spec = CallSpec::OutputSpec::New();
    spec->SetResultType(NewList());
    return spec;
  }

  void ExecuteInternal(boost::shared_ptr<CallSpec::Input>,
                       boost::shared_ptr<CallSpec::Output> output) override {
    const std::vector<Finding> findings = CheckMachine();
    const auto list = NewList();
    for (const Finding& finding : findings) list->Append(Row(finding));
    output->SetResult(list);
    const auto missing = std::ranges::count(findings, false, &Finding::isThere);
    if (missing > 0)
      output->ReportError(std::to_string(missing) + " of " + std::to_string(findings.size()) +
                          " parts are missing for this machine's own initiator.");
    output->Close();
  }
};

}  // namespace

boost::shared_ptr<AutoCli::NamespaceNode> NewCheck() {
  return boost::shared_ptr<AutoCli::NamespaceNode>(new LinuxCheck);
}

boost::shared_ptr<AutoCli::Namespace> NewNamespace() {
  auto linuxNode = AutoCli::Namespace::New();
  linuxNode->SetDescription("This machine's own iSCSI initiator.");
  linuxNode->RegisterNamespaceNode(NewCheck(), "check");
  return linuxNode;
}

}  // namespace linux
