// Long lists in each format: what a row costs above the host, at most 2 us.
#include <Plinth/AutoCli.h>
#include <Plinth/CallSpec.h>
#include <Plinth/MetaObj.h>
#include <benchmark/benchmark.h>

#include <string>
#include <utility>

#include "plinth/CommandLine.h"
#include "plinth/Console.h"

namespace {

using namespace Plinth::MetaObj;

constexpr int kRows = 100000;

/// A row such as the lists of targets have.
boost::shared_ptr<MetaStruct> Row(int number) {
  auto row = MetaStruct::New("Target");
  row->SetField("Name", "iqn.2026-11.org.example:volume-" + std::to_string(number));
  row->SetField("Alias", "volume " + std::to_string(number));
  row->SetField("Address", "10.1.2.3");
  row->SetField("Port", 3260);
  row->SetField("Discovery Methods", "sendtargets");
  row->SetField("Portal Group", 1);
  row->SetField("Connected", number % 2 == 0);
  return row;
}

boost::shared_ptr<MetaList> Rows() {
  auto list = MetaList::New(MetaType::Struct, Row(0));
  for (int number = 0; number < kRows; ++number) list->Append(Row(number));
  return list;
}

void PerRow(benchmark::State& state) {
  using benchmark::Counter;
  state.counters["row"] = Counter(kRows, Counter::kIsIterationInvariantRate | Counter::kInvert);
}

/// Posts rows that are there already.
class Lister final : public Plinth::AutoCli::Command {
 public:
  explicit Lister(boost::shared_ptr<MetaList> rows) : rows_(std::move(rows)) {}

 private:
  boost::shared_ptr<Plinth::CallSpec::InputSpec> GetInputSpecInternal() override {
    return Plinth::CallSpec::InputSpec::New();
  }
  boost::shared_ptr<Plinth::CallSpec::OutputSpec> GetOutputSpecInternal() override {
    auto spec = Plinth::CallSpec::OutputSpec::New();
    spec->SetResultType(MetaList::New(MetaType::Struct, Row(0)));
    return spec;
  }
  void ExecuteInternal(boost::shared_ptr<Plinth::CallSpec::Input>,
                       boost::shared_ptr<Plinth::CallSpec::Output> output) override {
    output->SetResult(rows_);
    output->Close();
  }

  boost::shared_ptr<MetaList> rows_;
};

/// A command from its line to the last row that is written.
void Write(benchmark::State& state, const char* format) {
  Lister lister(Rows());
  Plinth::TextConsole console;
  for (auto _ : state) {
    console.out.text.clear();  // and keeps its room
    const auto run = Plinth::RunCommand(lister, {std::string("--output=") + format}, console);
    if (run.status != 0) state.SkipWithError("the command failed");
  }
  PerRow(state);
}
BENCHMARK_CAPTURE(Write, simple, "simple")->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(Write, table, "table")->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(Write, json, "json")->Unit(benchmark::kMillisecond);

/// The rows themselves, made and freed.
void Make(benchmark::State& state) {
  for (auto _ : state) benchmark::DoNotOptimize(Rows());
  PerRow(state);
}
BENCHMARK(Make)->Unit(benchmark::kMillisecond);

}  // namespace
