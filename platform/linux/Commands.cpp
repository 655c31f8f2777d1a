#include "linux/Commands.h"

#include <algorithm>
#include <string>

#include "host/CallLog.h"
#include "host/Storage.h"
#include "linux/Adoption.h"
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

/// What changes whose machine the host is: `true`, or the reason why not.
class Operation : public AutoCli::Command {
 protected:
  explicit Operation(const std::string& description) {
    SetDescription(description);
    SetMetaDataField("type", "operation");
    SetDefaultOutputFormatter("simple");
  }

  virtual void Declare(CallSpec::InputSpec&) {}
  virtual void Run(const CallSpec::Input& input) = 0;

 private:
  boost::shared_ptr<CallSpec::InputSpec> GetInputSpecInternal() override {
    auto spec = CallSpec::InputSpec::New();
    Declare(*spec);
    return spec;
  }

  boost::shared_ptr<CallSpec::OutputSpec> GetOutputSpecInternal() override {
    auto spec = CallSpec::OutputSpec::New();
    spec->SetResultType(MetaObj::MetaBool::New());
    return spec;
  }

  void ExecuteInternal(boost::shared_ptr<CallSpec::Input> input,
                       boost::shared_ptr<CallSpec::Output> output) override {
    try {
      Run(*input);
    } catch (const host::Error& error) {
      host::CallLog::Current().Failed(error);
      output->ReportError(error.what());
      return;
    }
    output->SetResult(MetaObj::MetaBool::New(true));
    output->Close();
  }
};

class LinuxAdopt final : public Operation {
 public:
  LinuxAdopt() : Operation("Make this machine's own initiator the host that all commands are about.") {}

 private:
  static constexpr const char* kReplace = "replace";

  void Declare(CallSpec::InputSpec& spec) override {
    auto parameter = CallSpec::ParameterSpec::New(kReplace, CallSpec::ParameterType::Flag);
    parameter->SetHelp("Replace a host that was changed or described. What was configured of it is lost.");
    spec.AddParameter(parameter);
  }

  void Run(const CallSpec::Input& input) override { Adopt(input.GetFlag(kReplace)); }
};

class LinuxRelease final : public Operation {
 public:
  LinuxRelease()
      : Operation(
            "Give this machine's initiator back. Its sessions run on; what was configured of it is lost.") {}

 private:
  void Run(const CallSpec::Input&) override { Release(); }
};

}  // namespace

boost::shared_ptr<AutoCli::NamespaceNode> NewAdopt() {
  return boost::shared_ptr<AutoCli::NamespaceNode>(new LinuxAdopt);
}

boost::shared_ptr<AutoCli::NamespaceNode> NewRelease() {
  return boost::shared_ptr<AutoCli::NamespaceNode>(new LinuxRelease);
}

boost::shared_ptr<AutoCli::NamespaceNode> NewCheck() {
  return boost::shared_ptr<AutoCli::NamespaceNode>(new LinuxCheck);
}

boost::shared_ptr<AutoCli::Namespace> NewNamespace() {
  auto linuxNode = AutoCli::Namespace::New();
  linuxNode->SetDescription("This machine's own iSCSI initiator.");
  linuxNode->RegisterNamespaceNode(NewCheck(), "check");
  linuxNode->RegisterNamespaceNode(NewAdopt(), "adopt");
  linuxNode->RegisterNamespaceNode(NewRelease(), "release");
  return linuxNode;
}

}  // namespace linux
