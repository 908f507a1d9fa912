// SPDX-License-Identifier: MIT
// The cost of the add-in's timer tick, which runs ten times a second for as long as the IDE is open, on a
// generated group of 50 projects with 2,000 components. Targets: a tick that does not sample < 5 µs; a
// sampling tick (every sixth) < 50 µs.
#include "addin/connect.h"
#include "benchaddin.h"
#include "generator.h"
#include "host/model/objects.h"
#include "host/model/vbe.h"
#include "host/platform/manualloop.h"

#include <benchmark/benchmark.h>

#include <QTemporaryDir>

#include <memory>

namespace {

using bench::BenchAddIn;

/// The IDE with the group open, the add-in connected and two code windows of a large module shown.
struct Session {
  QTemporaryDir dir;
  std::shared_ptr<host::VbeImpl> vbe;
  std::shared_ptr<BenchAddIn> addIn;
  std::unique_ptr<addin::Connect> connection;
  std::shared_ptr<host::ComponentImpl> module;

  Session() {
    gen::GeneratorOptions options;
    options.codeLines = 400'000;
    options.components = 2000;
    options.projects = 50;
    options.seed = 7;
    const gen::GeneratedGroup group = gen::generateProjects(dir.filePath(QStringLiteral("corpus")), options);
    bench::installAddInIn(dir.path());

    vbe = host::VbeImpl::create();
    vbe->open(group.groupFile);
    addIn = std::make_shared<BenchAddIn>(vbe);
    connection = std::make_unique<addin::Connect>();
    QVariantList custom;
    connection->OnConnection(vbe, ide::ConnectMode::AfterStartup, addIn, custom);
    vbe->manualLoop()->DoEvents();
    // The largest module of the last project, shown in front with the focus, as while editing.
    for (const auto& component : vbe->projects().back()->components())
      if (component->hasCode() &&
          (!module || component->codeModule()->CountOfLines() > module->codeModule()->CountOfLines()))
        module = component;
    module->CodeModule()->CodePane()->Show();
  }
  addin::Globals& globals() { return *connection->globals(); }
  /// Scrolls to the procedure that holds line `line` (so that the next sample sees a move).
  void scrollTo(int line) { vbe->ActiveCodePane()->setTopLine(line); }
};

Session& session() {
  static Session instance;
  return instance;
}

void BM_TickWithoutSample(benchmark::State& state) {
  Session& s = session();
  addin::Globals& globals = s.globals();
  globals.onTimer();  // the procedure is on the focused code window from here on
  for (auto _ : state) {
    if (globals.sampler().SampleTime() == navigation::BrowseSampler::kSampleEveryMs) {
      state.PauseTiming();
      globals.onTimer();
      state.ResumeTiming();
    }
    globals.onTimer();
  }
  if (globals.hotKeyWindow().SubclassedWnd() == 0) state.SkipWithError("no code window had the focus");
}
BENCHMARK(BM_TickWithoutSample)->Unit(benchmark::kMicrosecond);

void BM_SamplingTickInOneProcedure(benchmark::State& state) {
  Session& s = session();
  addin::Globals& globals = s.globals();
  for (auto _ : state) {
    state.PauseTiming();
    while (globals.sampler().SampleTime() != navigation::BrowseSampler::kSampleEveryMs)
      globals.onTimer();
    state.ResumeTiming();
    globals.onTimer();
  }
}
BENCHMARK(BM_SamplingTickInOneProcedure)->Unit(benchmark::kMicrosecond);

void BM_SamplingTickThatRecordsAPlace(benchmark::State& state) {
  Session& s = session();
  addin::Globals& globals = s.globals();
  const int lines = s.module->CodeModule()->CountOfLines();
  int line = 1;
  for (auto _ : state) {
    state.PauseTiming();
    while (globals.sampler().SampleTime() != navigation::BrowseSampler::kSampleEveryMs)
      globals.onTimer();
    // Long enough in the last place, then somewhere else: the sample records the place that was left.
    for (int i = 0; i < 30; ++i)
      globals.onTimer();
    line = line + 97 > lines ? 1 : line + 97;
    s.scrollTo(line);
    while (globals.sampler().SampleTime() != navigation::BrowseSampler::kSampleEveryMs)
      globals.onTimer();
    state.ResumeTiming();
    globals.onTimer();
  }
  state.counters["places"] = globals.Histories().HistoryCount();
}
BENCHMARK(BM_SamplingTickThatRecordsAPlace)->Unit(benchmark::kMicrosecond);

}  // namespace

BENCHMARK_MAIN();
