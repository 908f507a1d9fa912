// SPDX-License-Identifier: MIT
// Project info files, in a temporary folder of the current directory (so on the disk it is run from).
// Targets: opening a project whose info file holds 10,000 tasks and 1,000 favourites (finding its
// identifier, reading the file, loading every task and favourite) < 100 ms; adding a task to it, the
// commit included (the whole file written, flushed and renamed into place) < 20 ms. The last two
// benchmarks split a commit: laying out the file in memory, and writing and flushing that many bytes.
#include "fileio/fileio.h"
#include "host/model/vbe.h"
#include "navigation/favorites.h"
#include "projinfo/projinfos.h"
#include "projinfo/records.h"
#include "projinfo/storage/mdlstorage.h"
#include "projinfo/tasklist.h"

#include <benchmark/benchmark.h>

#include <QDir>
#include <QFile>
#include <QTemporaryDir>

namespace {

using namespace projinfo;

constexpr int kTasks = 10'000;
constexpr int kFavorites = 1'000;
constexpr int kModules = 20;

/// A project of 20 modules of 50 procedures, its identifier module, and its info file full.
struct Fixture {
  QTemporaryDir dir{QDir::currentPath() + QStringLiteral("/projinfo_bench-XXXXXX")};
  std::shared_ptr<host::VbeImpl> vbe = host::VbeImpl::create();
  std::shared_ptr<host::ProjectImpl> project;
  ProjInfoServices services;

  Fixture() {
    QByteArray vbp = "Type=Exe\r\nModule=basQMInf000900; basQMInf000900.bas\r\n";
    QFile id(dir.filePath(QStringLiteral("basQMInf000900.bas")));
    id.open(QIODevice::WriteOnly);
    id.write("Attribute VB_Name = \"basQMInf000900\"\r\n'PROJID=000900\r\n");
    id.close();
    for (int m = 1; m <= kModules; ++m) {
      QByteArray code = "Attribute VB_Name = \"mod" + QByteArray::number(m) + "\"\r\nOption Explicit\r\n";
      for (int p = 1; p <= 50; ++p)
        code += "Public Sub Proc" + QByteArray::number(p) + "()\r\n    x = 1\r\n    x = 2\r\nEnd Sub\r\n";
      QFile file(dir.filePath(QStringLiteral("mod%1.bas").arg(m)));
      file.open(QIODevice::WriteOnly);
      file.write(code);
      vbp += "Module=mod" + QByteArray::number(m) + "; mod" + QByteArray::number(m) + ".bas\r\n";
    }
    QFile file(dir.filePath(QStringLiteral("Loja.vbp")));
    file.open(QIODevice::WriteOnly);
    file.write(vbp + "Name=\"Loja\"\r\n");
    file.close();
    project = vbe->openProject(dir.filePath(QStringLiteral("Loja.vbp")));

    bool isNew = true;
    auto root = OpenOrCreateDocFile(dir.filePath(QStringLiteral("qm000900.qmi")), isNew, true, false);
    auto tasks = root->CreateStorage(QStringLiteral("TaskList"), kElementMode);
    for (int id = 1; id <= kTasks; ++id)
      tasks->CreateStream(QStringLiteral("Task%1").arg(id), kElementMode)
          ->WriteData(TaskRecord{QStringLiteral("Conferir o cálculo do frete, pedido %1").arg(id),
                                 QStringLiteral("Tabela nova (de março)."), id % 3 == 0, id}
                          .toText());
    auto favorites = root->CreateStorage(QStringLiteral("Favorites"), kElementMode);
    for (int id = 1; id <= kFavorites; ++id)
      favorites->CreateStream(QStringLiteral("Favorite%1").arg(id), kElementMode)
          ->WriteData(FavoriteRecord{QStringLiteral("mod%1").arg(1 + id % kModules),
                                     QStringLiteral("Proc%1").arg(1 + id % 50), 0, id, 2}
                          .toText());
    root->CreateStream(QStringLiteral("LastTaskId"), kElementMode)->WriteData(kTasks);
    root->CreateStream(QStringLiteral("LastFavoriteId"), kElementMode)->WriteData(kFavorites);
    root->Commit(0);

    services.vbe = vbe.get();
    services.tellUser = false;
    services.createFavorites = [](CProjInfo& info) -> std::unique_ptr<InfoRecordList> {
      return std::make_unique<navigation::CFavorites>(info, nullptr);
    };
  }
};

void BM_OpenProjectWithItsInfoFile(benchmark::State& state) {
  Fixture fixture;
  for (auto _ : state) {
    ProjInfos infos(fixture.services);
    infos.projectAdded(fixture.project);
    CProjInfo& info = *infos.item(fixture.project);
    if (info.TaskList()->Tasks.Count() != kTasks ||
        dynamic_cast<navigation::CFavorites*>(info.Favorites())->Favorites.Count() != kFavorites)
      state.SkipWithError("not everything was loaded");
    state.PauseTiming();
    infos.closeAll();
    state.ResumeTiming();
  }
}
BENCHMARK(BM_OpenProjectWithItsInfoFile)->Unit(benchmark::kMillisecond);

void BM_AddTaskWithItsCommit(benchmark::State& state) {
  Fixture fixture;
  ProjInfos infos(fixture.services);
  infos.projectAdded(fixture.project);
  CTaskList& tasks = *infos.item(fixture.project)->TaskList();
  for (auto _ : state) {
    auto task = std::make_shared<CTaskItem>();
    task->Name = QStringLiteral("Nova tarefa");
    tasks.AddTask(task);
  }
}
BENCHMARK(BM_AddTaskWithItsCommit)->Unit(benchmark::kMillisecond);

void BM_LayOutTheFile(benchmark::State& state) {
  Fixture fixture;
  const QByteArray bytes = fileio::readFileBytes(fixture.dir.filePath(QStringLiteral("qm000900.qmi")));
  const auto root = readCompoundFile(bytes);
  for (auto _ : state)
    benchmark::DoNotOptimize(writeCompoundFile(*root));
  state.counters["bytes"] = static_cast<double>(bytes.size());
}
BENCHMARK(BM_LayOutTheFile)->Unit(benchmark::kMillisecond);

void BM_WriteAndFlushThatMuch(benchmark::State& state) {
  Fixture fixture;
  const QString path = fixture.dir.filePath(QStringLiteral("qm000900.qmi"));
  const QByteArray bytes = fileio::readFileBytes(path);
  for (auto _ : state)
    fileio::writeFileAtomically(path, bytes);
}
BENCHMARK(BM_WriteAndFlushThatMuch)->Unit(benchmark::kMillisecond);

}  // namespace

BENCHMARK_MAIN();
