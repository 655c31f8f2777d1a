// Long lists of sendtargets and static targets on one adapter: what it costs to add one more, and to list
// them.
#include <CoreCtl/Storage.h>
#include <benchmark/benchmark.h>

#include <ctime>
#include <memory>

#include "host/Host.h"
#include "plinth/CommandLine.h"
#include "simulator/Simulator.h"

extern "C" void AutoCli_RegisterNamespaces(boost::shared_ptr<Plinth::AutoCli::Namespace> parent);

namespace {

using NodeCtl::Network::HostAddress;
using NodeCtl::Storage::iScsiInterface;
using NodeCtl::Storage::StaticTarget;
using NodeCtl::Storage::TargetAddress;

constexpr int kMost = 10000;

/// The adapters hba0, with @p count sendtargets and static targets, and hba1, with none.
void UseHost(int count) {
  std::string lists[2];
  for (int i = 0; i < count; ++i) {
    const std::string portal =
        R"("host": "10.1.)" + std::to_string(i / 256) + "." + std::to_string(i % 256) + "\"}";
    lists[0] += (i > 0 ? ", {" : "{") + portal;
    lists[1] += std::string(i > 0 ? ", " : "") + R"({"name": "iqn.2026-11.org.example:t)" +
                std::to_string(i) + "\", " + portal;
  }
  constexpr char kCapabilities[] =
      R"("capabilities": {"Static Discovery Settable": true, "Sendtarget Discovery Settable": true})";
  host::Host::Use(simulator::HostOf(R"({"adapters": [{"name": "hba0", "sendTargets": [)" + lists[0] +
                                    R"(], "staticTargets": [)" + lists[1] + "], " + kCapabilities +
                                    R"(}, {"name": "hba1", )" + kCapabilities + "}]}"));
}

std::unique_ptr<iScsiInterface> FindAdapter(const char* name) {
  CoreCtl::Storage::StorageInfoImpl storage;
  return std::unique_ptr<iScsiInterface>(dynamic_cast<iScsiInterface*>(storage.GetScsiInterface(name)));
}

/// The time of adding the first entry to an empty list, and, as "last/first", how much longer it takes to add
/// the last of 10,000.
template <class Entry>
void AddLastAndFirst(benchmark::State& state, void (iScsiInterface::*add)(Entry),
                     void (iScsiInterface::*remove)(Entry), const Entry& entry) {
  UseHost(kMost - 1);
  const auto full = FindAdapter("hba0");
  const auto empty = FindAdapter("hba1");
  // Of the processor, so that what else runs on the machine does not count.
  const auto now = [] {
    timespec time;
    clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &time);
    return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_nsec) * 1e-9;
  };
  const auto timeOn = [&](iScsiInterface& adapter) {
    const double begin = now();
    (adapter.*add)(entry);
    const double time = now() - begin;
    (adapter.*remove)(entry);
    return time;
  };
  double first = 0;
  double last = 0;
  for ([[maybe_unused]] auto iteration : state) {
    const double time = timeOn(*empty);
    state.SetIterationTime(time);
    first += time;
    last += timeOn(*full);
  }
  state.counters["last/first"] = last / first;
  host::Host::Use(nullptr);
}

const TargetAddress kPortal(HostAddress("192.0.2.1"), 3260);

void AddSendTarget(benchmark::State& state) {
  AddLastAndFirst(state, &iScsiInterface::AddSendTargetAddress, &iScsiInterface::RemoveSendTargetAddress,
                  kPortal);
}
BENCHMARK(AddSendTarget)->UseManualTime();

void AddStaticTarget(benchmark::State& state) {
  AddLastAndFirst(state, &iScsiInterface::AddStaticTarget, &iScsiInterface::RemoveStaticTarget,
                  StaticTarget("iqn.2026-11.org.example:last", kPortal));
}
BENCHMARK(AddStaticTarget)->UseManualTime();

/// A listing command on an adapter with as many entries as the range says.
void List(benchmark::State& state, const char* command) {
  const auto root = Plinth::AutoCli::Namespace::New();
  AutoCli_RegisterNamespaces(root);
  UseHost(static_cast<int>(state.range(0)));
  for ([[maybe_unused]] auto iteration : state) {
    Plinth::TextConsole console;
    const auto run =
        Plinth::RunCommandLine(*root, {"iscsi", "adapter", "discovery", command, "list"}, console);
    if (run.status != 0) state.SkipWithError("the command failed");
  }
  state.SetComplexityN(state.range(0));
  host::Host::Use(nullptr);
}
BENCHMARK_CAPTURE(List, sendtarget, "sendtarget")
    ->RangeMultiplier(2)
    ->Range(1250, kMost)
    ->Complexity()
    ->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(List, statictarget, "statictarget")
    ->RangeMultiplier(2)
    ->Range(1250, kMost)
    ->Complexity()
    ->Unit(benchmark::kMillisecond);

}  // namespace
