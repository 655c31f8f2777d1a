#include "simulator/Commands.h"

#include <cstdio>
#include <string>

#include "host/CallLog.h"
#include "host/Storage.h"
#include "simulator/Description.h"
#include "simulator/Simulator.h"

namespace simulator {

namespace {

namespace AutoCli = Plinth::AutoCli;
namespace CallSpec = Plinth::CallSpec;
namespace MetaObj = Plinth::MetaObj;
using CallSpec::ParameterType;

constexpr const char* kFile = "file";
constexpr const char* kSecrets = "secrets";
/// Of a description: ten times what scripts/make-large-host writes of 100,000 targets, each with a session.
constexpr std::size_t kMostBytes = std::size_t{1} << 30U;

/// What the commands share: host failures are reported, results are posted.
class SimulatorCommand : public AutoCli::Command {
 protected:
  SimulatorCommand(const std::string& description, const std::string& type) {
    SetDescription(description);
    SetMetaDataField("type", type);
    SetDefaultOutputFormatter("simple");
  }

  /// Adds the parameters of the command.
  virtual void Declare(CallSpec::InputSpec&) {}
  virtual boost::shared_ptr<MetaObj::MetaObject> Prototype() { return MetaObj::MetaBool::New(); }
  virtual boost::shared_ptr<MetaObj::MetaObject> Run(const CallSpec::Input& input) = 0;

  boost::shared_ptr<CallSpec::InputSpec> GetInputSpecInternal() override {
    auto spec = CallSpec::InputSpec::New();
    Declare(*spec);
    return spec;
  }

  boost::shared_ptr<CallSpec::OutputSpec> GetOutputSpecInternal() override {
    auto spec = CallSpec::OutputSpec::New();
    spec->SetResultType(Prototype());
    return spec;
  }

  void ExecuteInternal(boost::shared_ptr<CallSpec::Input> input,
                       boost::shared_ptr<CallSpec::Output> output) override {
    try {
      output->SetResult(Run(*input));
    } catch (const host::Error& error) {
      host::CallLog::Current().Failed(error);
      output->ReportError(error.what());
      return;
    }
    output->Close();
  }

  /// Makes @p description the host.
  static boost::shared_ptr<MetaObj::MetaObject> Load(const std::string& description) {
    simulator::Load(description);
    return MetaObj::MetaBool::New(true);
  }
};

class SimulatorLoad final : public SimulatorCommand {
 public:
  SimulatorLoad()
      : SimulatorCommand("Replace the simulated host by the one that a file describes.", "operation") {}

 private:
  void Declare(CallSpec::InputSpec& spec) override {
    auto parameter = CallSpec::ParameterSpec::New(kFile, ParameterType::String);
    parameter->SetHelp("The host description, a JSON document; - reads standard input.");
    parameter->SetRequired(true);
    spec.AddParameter(parameter);
  }

  boost::shared_ptr<MetaObj::MetaObject> Run(const CallSpec::Input& input) override {
    const std::string file = input.GetString(kFile);
    std::string description;
    host::Host::Current().Settle();  // reading may have to wait
    if (file == "-") {
      host::ReadStandardInput(kMostBytes, description);
    } else if (!host::ReadFile(file, kMostBytes, description)) {
      throw host::Error(host::Error::Kind::NotFound, "There is no file " + file + ".");
    }
    try {
      return Load(description);
    } catch (const host::Error& error) {
      if (error.GetKind() != host::Error::Kind::Invalid) throw;
      throw host::Error(error.GetKind(), (file == "-" ? "standard input" : file) + ": " + error.what());
    }
  }
};

class SimulatorShow final : public SimulatorCommand {
 public:
  SimulatorShow()
      : SimulatorCommand(
            "Show the simulated host as a description, which load reads where it has the secrets.",
            "fetcher") {}

 private:
  void Declare(CallSpec::InputSpec& spec) override {
    auto parameter = CallSpec::ParameterSpec::New(kSecrets, ParameterType::Flag);
    parameter->SetHelp("Show secrets too, which are *** otherwise; load refuses those.");
    spec.AddParameter(parameter);
  }

  boost::shared_ptr<MetaObj::MetaObject> Prototype() override { return MetaObj::MetaString::New("{}"); }

  boost::shared_ptr<MetaObj::MetaObject> Run(const CallSpec::Input& input) override {
    return MetaObj::MetaString::New(simulator::Show(input.GetFlag(kSecrets)));
  }
};

class SimulatorPending final : public SimulatorCommand {
 public:
  SimulatorPending()
      : SimulatorCommand("List the changes that wait for a reset of their adapter, or for a reboot.",
                         "fetcher") {
    SetDefaultOutputFormatter("table");
  }

 private:
  static boost::shared_ptr<MetaObj::MetaStruct> Row(const host::WaitingChange& change) {
    auto row = MetaObj::MetaStruct::New("PendingChange");
    row->SetField("Adapter", change.adapter);
    row->SetField("Place", change.place);
    row->SetField("Setting", change.setting);
    row->SetField("From", change.from);
    row->SetField("To", change.to);
    row->SetField("Waits For", std::string(host::kEffects[static_cast<std::size_t>(change.effect)]));
    return row;
  }

  boost::shared_ptr<MetaObj::MetaObject> Prototype() override {
    return MetaObj::MetaList::New(MetaObj::MetaType::Struct, Row({}));
  }

  boost::shared_ptr<MetaObj::MetaObject> Run(const CallSpec::Input&) override {
    const auto list = MetaObj::MetaList::New(MetaObj::MetaType::Struct, Row({}));
    for (const host::WaitingChange& change : simulator::ShowPending()) list->Append(Row(change));
    return list;
  }
};

class SimulatorReset final : public SimulatorCommand {
 public:
  SimulatorReset() : SimulatorCommand("Replace the simulated host by the demo host.", "operation") {}

 private:
  boost::shared_ptr<MetaObj::MetaObject> Run(const CallSpec::Input&) override {
    return Load(std::string(DemoDescription()));
  }
};

class SimulatorReboot final : public SimulatorCommand {
 public:
  SimulatorReboot()
      : SimulatorCommand("Boot the simulated host again: changes that wait take effect, sessions start anew.",
                         "operation") {}

 private:
  boost::shared_ptr<MetaObj::MetaObject> Run(const CallSpec::Input&) override {
    simulator::Reboot();
    return MetaObj::MetaBool::New(true);
  }
};

}  // namespace

boost::shared_ptr<Plinth::AutoCli::NamespaceNode> NewLoad() {
  return boost::shared_ptr<Plinth::AutoCli::NamespaceNode>(new SimulatorLoad);
}

boost::shared_ptr<Plinth::AutoCli::NamespaceNode> NewShow() {
  return boost::shared_ptr<Plinth::AutoCli::NamespaceNode>(new SimulatorShow);
}

boost::shared_ptr<Plinth::AutoCli::NamespaceNode> NewPending() {
  return boost::shared_ptr<Plinth::AutoCli::NamespaceNode>(new SimulatorPending);
}

boost::shared_ptr<Plinth::AutoCli::NamespaceNode> NewReset() {
  return boost::shared_ptr<Plinth::AutoCli::NamespaceNode>(new SimulatorReset);
}

boost::shared_ptr<Plinth::AutoCli::NamespaceNode> NewReboot() {
  return boost::shared_ptr<Plinth::AutoCli::NamespaceNode>(new SimulatorReboot);
}

boost::shared_ptr<Plinth::AutoCli::Namespace> NewNamespace() {
  auto simulator = Plinth::AutoCli::Namespace::New();
  simulator->SetDescription("The simulated host behind the storage libraries.");
  simulator->RegisterNamespaceNode(NewLoad(), "load");
  simulator->RegisterNamespaceNode(NewShow(), "show");
  simulator->RegisterNamespaceNode(NewPending(), "pending");
  simulator->RegisterNamespaceNode(NewReset(), "reset");
  simulator->RegisterNamespaceNode(NewReboot(), "reboot");
  return simulator;
}

}  // namespace simulator
