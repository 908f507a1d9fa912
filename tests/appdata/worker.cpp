// SPDX-License-Identifier: MIT
// A second process on the application database, for the tests: `appdata_worker DIR ids N` draws N
// project identifiers and prints them; `appdata_worker DIR write N` writes versions 0 to N-1 of a macro
// text (300,000 times one letter, then the number), printing each version's number once it is committed.
#include "appdata/appinfofile.h"

#include <cstdio>
#include <exception>

int main(int argc, char** argv) {
  if (argc != 4) return 2;
  const QString mode = QString::fromLocal8Bit(argv[2]);
  const int count = QString::fromLocal8Bit(argv[3]).toInt();
  try {
    appdata::CAppInfoFile file;
    file.OpenFile(QString::fromLocal8Bit(argv[1]));
    for (int i = 0; i < count; ++i) {
      if (mode == QLatin1StringView("ids")) {
        std::printf("%s\n", file.GetNextProjId().toLatin1().constData());
      } else {
        file.WriteMacroText(u"Ctrl+Alt+A"_qs, QString(300'000, QChar(u'a' + i % 26)) + QString::number(i));
        std::printf("%d\n", i);
      }
      std::fflush(stdout);
    }
  } catch (const std::exception& failure) {
    std::fprintf(stderr, "%s\n", failure.what());
    return 1;
  }
  return 0;
}
