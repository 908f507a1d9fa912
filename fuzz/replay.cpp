// SPDX-License-Identifier: MIT
// A harness without libFuzzer: feeds it each file named on the command line, and each file of each folder
// named, in name order. A broken invariant aborts, naming the file on standard error first.
#include "fuzzcommon.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>

#include <cstdio>

int main(int argc, char** argv) {
  QStringList files;
  for (int i = 1; i < argc; ++i) {
    const QFileInfo info(QString::fromLocal8Bit(argv[i]));
    if (info.isDir()) {
      for (const QFileInfo& entry : QDir(info.filePath()).entryInfoList(QDir::Files, QDir::Name))
        files << entry.filePath();
    } else {
      files << info.filePath();
    }
  }
  for (const QString& path : files) {
    QFile file(path);
    if (!file.open(QIODevice::ReadOnly)) {
      std::fprintf(stderr, "cannot read %s\n", qPrintable(path));
      return 2;
    }
    const QByteArray bytes = file.readAll();
    std::fprintf(stderr, "%s\n", qPrintable(path));
    LLVMFuzzerTestOneInput(reinterpret_cast<const uint8_t*>(bytes.constData()), size_t(bytes.size()));
  }
  std::printf("%lld inputs replayed\n", static_cast<long long>(files.size()));
  return files.isEmpty() ? 1 : 0;
}
