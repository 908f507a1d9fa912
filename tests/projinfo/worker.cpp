// SPDX-License-Identifier: MIT
// A writer for the tests to kill: `projinfo_worker FILE N` adds tasks N times to the info file FILE, each
// with its counter in one commit, going on from the counter it finds, and prints each new counter once it
// is committed.
#include "projinfo/records.h"
#include "projinfo/storage/mdlstorage.h"

#include <cstdio>

int main(int argc, char** argv) {
  using namespace projinfo;
  if (argc != 3) return 2;
  try {
    bool isNew = true;
    auto root = OpenOrCreateDocFile(QString::fromLocal8Bit(argv[1]), isNew, true, false);
    auto tasks = root->CreateStorage(u"TaskList"_qs, kElementMode);
    auto counter = root->CreateStream(u"LastTaskId"_qs, kElementMode);
    qint32 last = counter->ReadData(vbLong).toInt();
    for (int i = 0; i < QString::fromLocal8Bit(argv[2]).toInt(); ++i) {
      ++last;
      const QString text =
          TaskRecord{u"Tarefa %1 "_qs.arg(last).repeated(1 + last % 40), {}, false, last}.toText();
      tasks->CreateStream(u"Task%1"_qs.arg(last), kElementMode)->WriteData(text);
      counter->SSeek(0);
      counter->WriteData(last);
      root->Commit(0);
      std::printf("%d\n", last);
      std::fflush(stdout);
    }
  } catch (const std::exception& failure) {
    std::fprintf(stderr, "%s\n", failure.what());
    return 1;
  }
  return 0;
}
