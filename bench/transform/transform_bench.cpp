// SPDX-License-Identifier: MIT
// The numbering and indentation walks at scale: a generated project of 1,000,000 code lines in about 200
// components, walked whole inside the IDE model through the object-model interface, yielding to the IDE's
// loop before every component, member and line as the dialogs do. Target: each walk under 1 s. Every
// iteration walks a freshly loaded model; loading (and, for removal, numbering first) is not timed.
#include "generator.h"
#include "host/model/vbe.h"
#include "transform/indentwalk.h"
#include "transform/numberwalk.h"
#include "transform/numindent.h"

#include <benchmark/benchmark.h>

#include <memory>

namespace {

/// Generated once for the whole run.
const gen::TemporaryGroup& corpus() {
  static const gen::TemporaryGroup instance({1'000'000, 200, 1, 7});
  return instance;
}

struct Model {
  std::shared_ptr<host::VbeImpl> vbe = host::VbeImpl::create();
  ide::Ref<ide::VBProject> project;
  walk::WalkContext context{QStringLiteral("bench"), &vbe->Platform().loop(), nullptr};
  int failures = 0;

  Model() {
    project = vbe->open(corpus().projectFile()).front();
    context.onFailure = [this](const walk::WalkFailure&) { ++failures; };
    context.onLineSkipped = [this](const walk::WalkFailure&) { ++failures; };
  }
  void number(bool add) { transform::NumberingWalk(context, 10000, 5).NumberProject(project, add); }
};

// Runs `walk` on a fresh model per iteration; `prepare` runs untimed before it.
template <class Prepare, class Walk>
void walkFreshModels(benchmark::State& state, Prepare&& prepare, Walk&& walk) {
  corpus();
  int failures = 0;
  for (auto _ : state) {
    state.PauseTiming();
    auto model = std::make_unique<Model>();
    prepare(*model);
    state.ResumeTiming();
    walk(*model);
    state.PauseTiming();
    failures += model->failures;
    model.reset();
    state.ResumeTiming();
  }
  if (failures) state.SkipWithError("the walk reported failures");
  state.counters["lines"] = double(corpus().group().codeLines);
}

void BM_NumberProject(benchmark::State& state) {
  walkFreshModels(
      state, [](Model&) {}, [](Model& m) { m.number(true); });
}

void BM_UnnumberProject(benchmark::State& state) {
  walkFreshModels(
      state, [](Model& m) { m.number(true); }, [](Model& m) { m.number(false); });
}

void BM_IndentProject(benchmark::State& state) {
  walkFreshModels(
      state, [](Model&) {},
      [](Model& m) {
        transform::IndentationWalk(m.context, transform::IndentMode::Spaces, 4).IndentProject(m.project);
      });
}

void BM_NumIndentProject(benchmark::State& state) {
  walkFreshModels(
      state, [](Model&) {},
      [](Model& m) {
        transform::NumIndentWalk(m.context, 10000, 5, transform::IndentMode::Tabs, 1, true)
            .NumIndentProject(m.project);
      });
}

}  // namespace

BENCHMARK(BM_NumberProject)->Unit(benchmark::kMillisecond)->Iterations(3);
BENCHMARK(BM_UnnumberProject)->Unit(benchmark::kMillisecond)->Iterations(3);
BENCHMARK(BM_IndentProject)->Unit(benchmark::kMillisecond)->Iterations(3);
BENCHMARK(BM_NumIndentProject)->Unit(benchmark::kMillisecond)->Iterations(3);

BENCHMARK_MAIN();
