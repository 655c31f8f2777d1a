/// What every start of hcli pays for its commands, ahead of the one that runs: at most 0.3 ms.
#include <Plinth/AutoCli.h>
#include <benchmark/benchmark.h>

#include "host/Host.h"
#include "plinth/CommandLine.h"
#include "simulator/Simulator.h"

// The plug-in's entry point, which the framework finds by its name.
extern "C" void AutoCli_RegisterNamespaces(boost::shared_ptr<Plinth::AutoCli::Namespace> parent);

namespace {

boost::shared_ptr<Plinth::AutoCli::Namespace> NewTree() {
  auto root = Plinth::AutoCli::Namespace::New();
  AutoCli_RegisterNamespaces(root);
  Plinth::RegisterOwnCommands(*root);
  return root;
}

void Registration(benchmark::State& state) {
  for (auto _ : state) benchmark::DoNotOptimize(NewTree());
}
BENCHMARK(Registration)->Unit(benchmark::kMicrosecond);

/// A whole command without a process around it, on a host of so many adapters in memory.
void AdapterList(benchmark::State& state) {
  std::string adapters;
  for (std::int64_t number = 0; number < state.range(0); ++number) {
    adapters += (number == 0 ? "" : ",") + (R"({"name": "hba)" + std::to_string(number) + "\"}");
  }
  host::Host::Use(simulator::HostOf(R"({"adapters": [)" + adapters + "]}"));
  const auto root = NewTree();
  for (auto _ : state) {
    Plinth::TextConsole console;
    const Plinth::RunRecord record = Plinth::RunCommandLine(*root, {"iscsi", "adapter", "list"}, console);
    if (record.status != 0) state.SkipWithError("the command failed");
  }
  host::Host::Use(nullptr);
}
BENCHMARK(AdapterList)->Arg(3)->Arg(300)->Unit(benchmark::kMicrosecond);

}  // namespace
