// SPDX-License-Identifier: MIT
// The application database, in a temporary folder of the current directory (so on the disk it is run
// from). Targets: opening the file and loading every macro and copy buffer as the add-in does at start-up
// < 20 ms; 1,000 project identifiers, each committed durably, < 5 s. The last benchmark measures one
// flushed write of a page on the same disk: the floor under every durable commit.
#include "appdata/appinfofile.h"

#include <benchmark/benchmark.h>

#include <QDir>
#include <QStringList>
#include <QTemporaryDir>

#include <fcntl.h>
#include <unistd.h>

namespace {

QTemporaryDir benchDir() {
  return QTemporaryDir(QDir::currentPath() + QStringLiteral("/appdata_bench-XXXXXX"));
}

/// The keys the macros and copy buffers use: 41 macros, 10 buffers.
QStringList macroIds() {
  QStringList ids;
  for (char letter = 'A'; letter <= 'Z'; ++letter)
    if (!QByteArrayView("CIJVX").contains(letter))
      ids << QStringLiteral("Ctrl+Alt+%1").arg(QLatin1Char(letter));
  for (char letter = 'A'; letter <= 'Z'; ++letter)
    if (!QByteArrayView("CFIJVX").contains(letter))
      ids << QStringLiteral("Ctrl+Shift+%1").arg(QLatin1Char(letter));
  return ids;
}

QStringList bufferIds() {
  QStringList ids;
  for (int digit = 0; digit <= 9; ++digit)
    ids << QStringLiteral("Ctrl+%1").arg(digit);
  return ids;
}

void BM_OpenAndLoadMacrosAndBuffers(benchmark::State& state) {
  const QTemporaryDir dir = benchDir();
  {
    appdata::CAppInfoFile db;
    db.OpenFile(dir.path());
    for (const QString& id : macroIds())
      db.WriteMacroText(
          id,
          QStringLiteral("' {ProcedureName} por {UserName} em {Date}\r\nDim {C} As Long\r\n").repeated(3));
    for (const QString& id : bufferIds())
      db.WriteCopyBufferText(id, QStringLiteral("    If rs.EOF Then GoTo 100\r\n").repeated(60));
  }
  const QStringList macros = macroIds();
  const QStringList buffers = bufferIds();
  for (auto _ : state) {
    appdata::CAppInfoFile db;
    db.OpenFile(dir.path());
    for (const QString& id : macros) {
      benchmark::DoNotOptimize(db.GetMacroText(id));
      benchmark::DoNotOptimize(db.GetMacroState(id));
    }
    for (const QString& id : buffers) {
      benchmark::DoNotOptimize(db.GetCopyBufferState(id));
      benchmark::DoNotOptimize(db.GetCopyBufferText(id));
    }
  }
}
BENCHMARK(BM_OpenAndLoadMacrosAndBuffers)->Unit(benchmark::kMillisecond);

void BM_ThousandProjectIdentifiers(benchmark::State& state) {
  const QTemporaryDir dir = benchDir();
  appdata::CAppInfoFile db;
  db.OpenFile(dir.path());
  for (auto _ : state)
    for (int i = 0; i < 1000; ++i)
      benchmark::DoNotOptimize(db.GetNextProjId());
}
BENCHMARK(BM_ThousandProjectIdentifiers)->Unit(benchmark::kMillisecond)->Iterations(1);

void BM_FlushedPageWrite(benchmark::State& state) {
  const QTemporaryDir dir = benchDir();
  const int fd =
      ::open(QFile::encodeName(dir.filePath(QStringLiteral("page"))).constData(), O_RDWR | O_CREAT, 0600);
  const QByteArray page(1024, 'x');
  for (auto _ : state) {
    benchmark::DoNotOptimize(::pwrite(fd, page.constData(), page.size(), 0));
    ::fdatasync(fd);
  }
  ::close(fd);
}
BENCHMARK(BM_FlushedPageWrite)->Unit(benchmark::kMillisecond);

}  // namespace

BENCHMARK_MAIN();
