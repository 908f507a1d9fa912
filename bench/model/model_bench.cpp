// SPDX-License-Identifier: MIT
// The IDE model at scale: a generated project of 1,000,000 code lines in about 200 components, loaded,
// queried, edited, searched and saved. Targets: load ≤ 1 s and ≤ 400 MB resident; ProcOfLine over every
// line ≤ 0.5 s; ReplaceLine on every line ≤ 1 s; a whole-word Find of a common identifier over every
// module ≤ 0.5 s; saving every module ≤ 1 s.
#include "generator.h"
#include "host/model/vbe.h"

#include <benchmark/benchmark.h>

#include <QFile>

#include <memory>

namespace {

/// Generated once for the whole run.
const gen::TemporaryGroup& corpus() {
  static const gen::TemporaryGroup instance({1'000'000, 200, 1, 42});
  return instance;
}

/// Resident memory of the process in MB.
double residentMegabytes() {
  QFile status(QStringLiteral("/proc/self/status"));
  if (!status.open(QIODevice::ReadOnly)) return 0;
  for (const QByteArray& line : status.readAll().split('\n'))
    if (line.startsWith("VmRSS:")) return line.mid(6).trimmed().split(' ').front().toDouble() / 1024.0;
  return 0;
}

std::shared_ptr<host::VbeImpl> loaded() {
  auto vbe = host::VbeImpl::create();
  vbe->open(corpus().projectFile());
  return vbe;
}

template <class F>
void forEachModule(const std::shared_ptr<host::VbeImpl>& vbe, F&& f) {
  for (const auto& project : vbe->projects())
    for (const auto& component : project->components())
      if (auto module = component->codeModule()) f(*component, *module);
}

void BM_Load(benchmark::State& state) {
  corpus();
  const double before = residentMegabytes();
  double peak = 0;
  for (auto _ : state) {
    auto vbe = loaded();
    peak = std::max(peak, residentMegabytes());
    state.PauseTiming();
    vbe.reset();
    state.ResumeTiming();
  }
  state.counters["rss_mb"] = peak;
  state.counters["model_mb"] = peak - before;
  state.counters["lines"] = static_cast<double>(corpus().group().codeLines);
}
BENCHMARK(BM_Load)->Unit(benchmark::kMillisecond)->Iterations(3);

void BM_ProcOfLineEveryLine(benchmark::State& state) {
  auto vbe = loaded();
  qint64 owned = 0;
  for (auto _ : state) {
    forEachModule(vbe, [&](host::ComponentImpl&, host::CodeModuleImpl& module) {
      ide::ProcKind kind;
      const int count = module.CountOfLines();
      for (int line = 1; line <= count; ++line)
        owned += module.ProcOfLine(line, kind).size();
    });
  }
  benchmark::DoNotOptimize(owned);
}
BENCHMARK(BM_ProcOfLineEveryLine)->Unit(benchmark::kMillisecond)->Iterations(3);

void BM_ReplaceLineEveryLine(benchmark::State& state) {
  for (auto _ : state) {
    state.PauseTiming();
    auto vbe = loaded();
    state.ResumeTiming();
    forEachModule(vbe, [&](host::ComponentImpl&, host::CodeModuleImpl& module) {
      const int count = module.CountOfLines();
      for (int line = 1; line <= count; ++line) {
        const QString text = module.Lines(line, 1);
        module.ReplaceLine(line, text.isEmpty() ? text : text + u' ');
      }
    });
    state.PauseTiming();
    vbe.reset();
    state.ResumeTiming();
  }
}
BENCHMARK(BM_ReplaceLineEveryLine)->Unit(benchmark::kMillisecond)->Iterations(3);

void BM_FindWholeWordEveryModule(benchmark::State& state) {
  auto vbe = loaded();
  qint64 hits = 0;
  const QString target = QStringLiteral("m_lngContador");
  for (auto _ : state) {
    hits = 0;
    forEachModule(vbe, [&](host::ComponentImpl&, host::CodeModuleImpl& module) {
      int startLine = 1, startColumn = 1, endLine = -1, endColumn = -1;
      while (module.Find(target, startLine, startColumn, endLine, endColumn, true, false, false)) {
        ++hits;
        startColumn = endColumn;  // go on after this match
        endLine = -1;
        endColumn = -1;
      }
    });
  }
  state.counters["hits"] = static_cast<double>(hits);
}
BENCHMARK(BM_FindWholeWordEveryModule)->Unit(benchmark::kMillisecond)->Iterations(3);

void BM_SaveEveryModule(benchmark::State& state) {
  auto vbe = loaded();
  for (auto _ : state) {
    // As saving the project does: every file written, flushed to disk together, then put in place.
    host::SaveBatch batch;
    forEachModule(vbe, [&](host::ComponentImpl& component, host::CodeModuleImpl&) {
      component.addToBatch(batch, true);
    });
    batch.commit();
  }
}
BENCHMARK(BM_SaveEveryModule)->Unit(benchmark::kMillisecond)->Iterations(3);

}  // namespace

BENCHMARK_MAIN();
