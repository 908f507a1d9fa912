// SPDX-License-Identifier: MIT
// Tests of whole-file reads and atomic writes in a temporary directory: the error numbers and descriptions
// of each failure, and that a failed write leaves the old file as it was.
#include "fileio/fileio.h"

#include "testtext.h"

#include <gtest/gtest.h>

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QTemporaryDir>

#include <csignal>

#include <fcntl.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

namespace fileio {
namespace {

using host::testing::expectError;

void writePlainFile(const QString& path, const QByteArray& bytes) {
  QFile file(path);
  ASSERT_TRUE(file.open(QIODevice::WriteOnly));
  ASSERT_EQ(file.write(bytes), bytes.size());
}

QByteArray readPlainFile(const QString& path) {
  QFile file(path);
  if (!file.open(QIODevice::ReadOnly)) return "<unreadable>";
  return file.readAll();
}

/// Whether permission bits bind this process (they do not for root).
bool permissionsApply(const QString& unreadablePath) {
  QFile probe(unreadablePath);
  return !probe.open(QIODevice::ReadOnly);
}

class FileIoTest : public ::testing::Test {
 protected:
  void SetUp() override { ASSERT_TRUE(m_directory.isValid()); }
  QString path(const QString& name) const { return m_directory.filePath(name); }

  QTemporaryDir m_directory;
};

TEST_F(FileIoTest, ReadsTheBytesAsTheyAre) {
  const QByteArray bytes("Attribute VB_Name = \"Module1\"\r\n\xE7\xE3o\r\n\x81\x00\xFF", 39);
  writePlainFile(path("Module1.bas"), bytes);
  EXPECT_EQ(readFileBytes(path("Module1.bas")), bytes);
  writePlainFile(path("empty.bas"), {});
  EXPECT_TRUE(readFileBytes(path("empty.bas")).isEmpty());
}

TEST_F(FileIoTest, FailuresNameThePathAndTheReason) {
  ASSERT_TRUE(QDir(m_directory.path()).mkdir(u"Forms"_qs));
  const QString missing = path("Missing.bas");
  ide::Error error = expectError([&] { readFileBytes(missing); });
  EXPECT_EQ(error.number(), ide::err::FileNotFound);
  EXPECT_EQ(error.description(), u"File not found: "_qs + missing);

  error = expectError([&] { readFileBytes(path("Forms")); });
  EXPECT_EQ(error.number(), ide::err::PathFileAccessError);
  EXPECT_TRUE(error.description().startsWith(u"Cannot read %1: "_qs.arg(path("Forms")))) << error.what();

  const QString target = path("NoSuchFolder/Module1.bas");
  error = expectError([&] { writeFileAtomically(target, "x"); });
  EXPECT_EQ(error.number(), ide::err::PathFileAccessError);
  EXPECT_TRUE(error.description().startsWith(u"Cannot write %1: "_qs.arg(target))) << error.what();
}

TEST_F(FileIoTest, UnreadableFileIsAccessError) {
  const QString locked = path("Locked.frm");
  writePlainFile(locked, "VERSION 5.00\r\n");
  ASSERT_TRUE(QFile::setPermissions(locked, QFileDevice::Permissions()));
  if (!permissionsApply(locked)) GTEST_SKIP() << "permission bits do not apply to this user (root)";
  const ide::Error error = expectError([&] { readFileBytes(locked); });
  EXPECT_EQ(error.number(), ide::err::PathFileAccessError);
  EXPECT_TRUE(error.description().startsWith(u"Cannot read "_qs + locked + u": "_qs)) << error.what();
  EXPECT_GT(error.description().size(), (u"Cannot read "_qs + locked + u": "_qs).size())
      << "the reason is given";
}

TEST_F(FileIoTest, WriteCreatesOrReplacesAFileAndLeavesNoTemporaryFile) {
  writeFileAtomically(path("New.bas"), "Attribute VB_Name = \"New\"\r\n");
  EXPECT_EQ(readPlainFile(path("New.bas")), QByteArray("Attribute VB_Name = \"New\"\r\n"));
  writePlainFile(path("Class1.cls"), "old content that is longer than the new one\r\n");
  writeFileAtomically(path("Class1.cls"), "new\r\n");
  EXPECT_EQ(readPlainFile(path("Class1.cls")), QByteArray("new\r\n"));
  EXPECT_EQ(QDir(m_directory.path()).entryList(QDir::Files), (QStringList{u"Class1.cls"_qs, u"New.bas"_qs}));
}

TEST_F(FileIoTest, WriteIntoReadOnlyDirectoryFailsAndKeepsTheOldFile) {
  const QString subdirectory = path("ReadOnly");
  ASSERT_TRUE(QDir(m_directory.path()).mkdir(u"ReadOnly"_qs));
  const QString target = subdirectory + u"/Form1.frm"_qs;
  writePlainFile(target, "old\r\n");
  ASSERT_TRUE(QFile::setPermissions(subdirectory, QFileDevice::ReadOwner | QFileDevice::ExeOwner));
  const bool bound = !QFile(subdirectory + u"/probe"_qs).open(QIODevice::WriteOnly);
  if (!bound) {
    QFile::remove(subdirectory + u"/probe"_qs);
    QFile::setPermissions(subdirectory,
                          QFileDevice::ReadOwner | QFileDevice::WriteOwner | QFileDevice::ExeOwner);
    GTEST_SKIP() << "permission bits do not apply to this user (root)";
  }
  const ide::Error error = expectError([&] { writeFileAtomically(target, "new\r\n"); });
  QFile::setPermissions(subdirectory,
                        QFileDevice::ReadOwner | QFileDevice::WriteOwner | QFileDevice::ExeOwner);
  EXPECT_EQ(error.number(), ide::err::PathFileAccessError);
  EXPECT_TRUE(error.description().startsWith(u"Cannot write "_qs + target + u": "_qs)) << error.what();
  EXPECT_EQ(readPlainFile(target), QByteArray("old\r\n"));
  EXPECT_EQ(QDir(subdirectory).entryList(QDir::Files), QStringList{u"Form1.frm"_qs});
}

TEST(FileWriteBatchTest, FilesAddedTogetherAreAllOrNothing) {
  QTemporaryDir dir;
  std::vector<FileWriteBatch::File> files;
  for (int i = 0; i < 12; ++i) {
    const QString path = dir.filePath(u"m%1.bas"_qs.arg(i));
    if (i > 0) writePlainFile(path, "old");  // m0.bas is new
    files.push_back({path, QByteArray("new ") + QByteArray::number(i), {}});
  }
  const auto expectOld = [&](const char* when) {
    EXPECT_FALSE(QFile::exists(files[0].path)) << when;
    for (std::size_t i = 1; i < files.size(); ++i)
      EXPECT_EQ(readPlainFile(files[i].path), QByteArray("old")) << when;
    EXPECT_EQ(QDir(dir.path()).entryList(QDir::Files | QDir::Hidden).size(), 11) << "a temporary is left";
  };
  ASSERT_TRUE(QDir().mkpath(dir.filePath(u"in-the-way.bas"_qs)));
  std::vector<FileWriteBatch::File> withDirectory = files;
  withDirectory.insert(withDirectory.begin() + 5, {dir.filePath(u"in-the-way.bas"_qs), "x", {}});
  FileWriteBatch failing;
  const ide::Error error = expectError([&] { failing.addAll(withDirectory); });
  EXPECT_TRUE(error.description().contains(u"in-the-way.bas"_qs));
  EXPECT_TRUE(failing.empty());
  expectOld("after a failed add");
  {
    FileWriteBatch abandoned;
    abandoned.addAll(files);
  }
  expectOld("after an abandoned batch");

  FileWriteBatch batch;
  batch.addAll(files);
  expectOld("before the commit");
  batch.commit();
  for (const FileWriteBatch::File& file : files)
    EXPECT_EQ(readPlainFile(file.path), file.bytes);
  EXPECT_EQ(QDir(dir.path()).entryList(QDir::Files | QDir::Hidden).size(), 12);
}

QStringList hiddenFiles(const QString& directory) {
  return QDir(directory).entryList(QDir::Files | QDir::Hidden | QDir::System).filter(u".quimbel-"_qs);
}

TEST(FileWriteBatchTest, KeepsModeOwnerLinksAndRefusesAReadOnlyFile) {
  QTemporaryDir dir;
  const QString real = dir.filePath(u"Real.bas"_qs);
  const QString chain = dir.filePath(u"l1.bas"_qs);  // l1.bas -> sub/l2.bas -> ../Real.bas
  writePlainFile(real, "old");
  ASSERT_TRUE(QDir(dir.path()).mkdir(u"sub"_qs));
  ASSERT_EQ(::symlink("../Real.bas", QFile::encodeName(dir.filePath(u"sub/l2.bas"_qs))), 0);
  ASSERT_EQ(::symlink("sub/l2.bas", QFile::encodeName(chain)), 0);
  ASSERT_EQ(::chmod(QFile::encodeName(real), 0640), 0);
  const bool root = ::geteuid() == 0;
  if (root) {
    ASSERT_EQ(::chown(QFile::encodeName(real), 4321, 4322), 0);
  }
  const QString linked = dir.filePath(u"Linked.cls"_qs);
  const QString other = dir.filePath(u"Other.cls"_qs);
  writePlainFile(linked, "old");
  ASSERT_EQ(::link(QFile::encodeName(linked), QFile::encodeName(other)), 0);
  struct stat before {};
  ::stat(QFile::encodeName(linked), &before);

  FileWriteBatch batch;
  batch.addAll({{chain, "new real", {}}, {linked, "new linked", {}}});
  batch.commit();
  struct stat after {};
  ASSERT_EQ(::stat(QFile::encodeName(real), &after), 0);
  EXPECT_EQ(readPlainFile(real), QByteArray("new real"));
  EXPECT_TRUE(QFileInfo(chain).isSymLink() && QFileInfo(dir.filePath(u"sub/l2.bas"_qs)).isSymLink());
  EXPECT_EQ(after.st_mode & 07777, 0640u);
  if (root) {
    EXPECT_EQ(std::pair(after.st_uid, after.st_gid), std::pair(4321u, 4322u));
  }
  ASSERT_EQ(::stat(QFile::encodeName(other), &after), 0);
  EXPECT_EQ(readPlainFile(other), QByteArray("new linked"));  // still one file under two names
  EXPECT_EQ(after.st_ino, before.st_ino);

  // A read-only file is refused (even for root), and nothing of the batch is written.
  ASSERT_EQ(::chmod(QFile::encodeName(linked), 0444), 0);
  FileWriteBatch refused;
  const ide::Error error = expectError([&] { refused.addAll({{real, "x", {}}, {linked, "y", {}}}); });
  EXPECT_EQ(error.number(), ide::err::PermissionDenied);
  EXPECT_EQ(error.description(), u"Cannot write %1: the file is read-only"_qs.arg(linked));
  EXPECT_EQ(readPlainFile(real), QByteArray("new real"));
  EXPECT_TRUE(hiddenFiles(dir.path()).isEmpty());
}

TEST(FileWriteBatchTest, AFailedRenamePutsBackWhatWasReplacedOrSaysWhichFilesHoldTheNewText) {
  for (const bool restoreFails : {false, true}) {
    QTemporaryDir dir;
    std::vector<FileWriteBatch::File> files;
    for (int i = 0; i < 6; ++i) {
      const QString path = dir.filePath(u"Mod%1.bas"_qs.arg(i));
      if (i != 1) writePlainFile(path, "old");  // Mod1.bas is new
      files.push_back({path, QByteArray("new ") + QByteArray::number(i), {}});
    }
    // Hard-linked: rewritten in place.
    ASSERT_EQ(::link(QFile::encodeName(files[2].path), QFile::encodeName(dir.filePath(u"x"_qs))), 0);
    setFileFaultHook([&](FileStep step, const QString& path) {
      if (step == FileStep::Replace && path.endsWith(u"Mod4.bas"_qs)) return EIO;
      return step == FileStep::Restore && restoreFails && path.endsWith(u"Mod0.bas"_qs) ? EIO : 0;
    });
    FileWriteBatch batch;
    batch.addAll(files);
    const QString description = expectError([&] { batch.commit(); }).description();
    setFileFaultHook({});
    EXPECT_TRUE(description.startsWith(u"Cannot write %1: "_qs.arg(files[4].path))) << restoreFails;
    for (int i = 0; i < 6; ++i)
      EXPECT_EQ(readPlainFile(files[size_t(i)].path), i == 0 && restoreFails ? QByteArray("new 0")
                                                      : i == 1               ? QByteArray("<unreadable>")
                                                                             : QByteArray("old"))
          << i;
    EXPECT_EQ(batch.written(0) != nullptr, restoreFails);
    // The backup that holds the old text is the one file left, and the message names it.
    EXPECT_EQ(hiddenFiles(dir.path()).size(), restoreFails ? 1 : 0);
    EXPECT_EQ(description.contains(u"%1 holds the new text"_qs.arg(files[0].path)) &&
                  description.contains(hiddenFiles(dir.path()).value(0, u"?"_qs)),
              restoreFails)
        << description.toStdString();
  }
}

TEST(FileWriteBatchTest, AFileChangedOrDeletedSinceItWasReadIsNotReplaced) {
  const timespec future{::time(nullptr) + 5, 123456789};
  const auto setTime = [](const QString& path, timespec time) {
    const timespec times[2] = {time, time};
    ::utimensat(AT_FDCWD, QFile::encodeName(path).constData(), times, 0);
  };
  struct Case {
    const char* what;
    std::function<void(const QString&)> meddle;
    int expected;  // 0 as read, 1 changed, 2 deleted
  } cases[] = {
      {"untouched", [](const QString&) {}, 0},
      {"touched only",
       [&](const QString& path) {
         setTime(path, {::time(nullptr) + 60, 0});
       },
       0},
      {"rewritten in the tick it was read in, time put back",
       [&](const QString& path) {
         writePlainFile(path, "OLD");
         setTime(path, future);
       },
       1},
      {"deleted", [](const QString& path) { QFile::remove(path); }, 2},
  };
  for (const Case& c : cases) {
    QTemporaryDir dir;
    const QString path = dir.filePath(u"Form1.frm"_qs);
    writePlainFile(path, "old");
    setTime(path, future);
    FileStamp stamp;
    readFileBytes(path, &stamp);
    c.meddle(path);
    const QByteArray before = readPlainFile(path);
    FileWriteBatch batch;
    batch.add({path, "new", stamp});
    if (c.expected == 0) {
      batch.commit();
      EXPECT_EQ(readPlainFile(path), QByteArray("new")) << c.what;
      continue;
    }
    try {
      batch.commit();
      ADD_FAILURE() << c.what << ": replaced";
    } catch (const FilesChangedOnDisk& error) {
      EXPECT_EQ(error.changed, c.expected == 1 ? QStringList{path} : QStringList()) << c.what;
      EXPECT_EQ(error.deleted, c.expected == 2 ? QStringList{path} : QStringList()) << c.what;
    }
    EXPECT_EQ(readPlainFile(path), before) << c.what;
    EXPECT_TRUE(hiddenFiles(dir.path()).isEmpty()) << c.what;
  }
}

// Child processes: a low limit of open files, and signals that arrive while a batch writes.
int g_ready = -1;  // the child's end of the pipe that tells the parent to act

int inChild(const std::function<void()>& body, const std::function<void(pid_t)>& whenReady = {}) {
  int ends[2];
  if (::pipe(ends) != 0) return -1;
  const pid_t child = ::fork();
  if (child == 0) {
    ::close(ends[0]);
    g_ready = ends[1];
    try {
      body();
    } catch (...) {
      ::_exit(2);
    }
    ::_exit(0);
  }
  ::close(ends[1]);
  char byte;
  if (::read(ends[0], &byte, 1) == 1 && whenReady) whenReady(child);
  ::close(ends[0]);
  int status = 0;
  ::waitpid(child, &status, 0);
  return status;
}

std::vector<FileWriteBatch::File> manyFiles(const QTemporaryDir& dir, int count) {
  std::vector<FileWriteBatch::File> files;
  for (int i = 0; i < count; ++i)
    files.push_back({dir.filePath(u"Mod%1.bas"_qs.arg(i)), QByteArray(300, 'x'), {}});
  return files;
}

TEST(FileWriteBatchTest, ABatchOfMoreFilesThanMayBeOpenAtOnceIsWritten) {
  // In memory where it can be: 1,500 flushes to a disk take seconds.
  const bool shm = QFileInfo(u"/dev/shm"_qs).isWritable();
  QTemporaryDir dir(shm ? u"/dev/shm/quimbel-XXXXXX"_qs : QDir::tempPath() + u"/q-XXXXXX"_qs);
  const int status = inChild([&] {
    const rlimit limit{1024, 1024};
    ::setrlimit(RLIMIT_NOFILE, &limit);
    FileWriteBatch batch;
    batch.addAll(manyFiles(dir, 1500));
    batch.commit();
  });
  EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0) << status;
  EXPECT_EQ(QDir(dir.path()).entryList(QDir::Files | QDir::Hidden).size(), 1500);
}

TEST(FileWriteBatchTest, ASignalWhileWritingLeavesNothingBehindAndAKilledSaveIsSweptNextTime) {
  for (const int signal : {SIGINT, SIGTERM, SIGHUP, SIGKILL}) {
    QTemporaryDir dir;
    writePlainFile(dir.filePath(u"Mod0.bas"_qs), "old");
    const int status = inChild(
        [&] {
          const rlimit limit{64, 64};  // flushed and named in groups of 16
          ::setrlimit(RLIMIT_NOFILE, &limit);
          setFileFaultHook([](FileStep, const QString& path) {
            if (path.endsWith(u"Mod60.bas"_qs)) {
              if (::write(g_ready, "!", 1) != 1) ::_exit(3);
              ::usleep(300000);
            }
            return 0;
          });
          FileWriteBatch batch;
          batch.addAll(manyFiles(dir, 100));
          batch.commit();
        },
        [&](pid_t child) { ::kill(child, signal); });
    EXPECT_TRUE(WIFSIGNALED(status) && WTERMSIG(status) == signal) << signal << " " << status;
    EXPECT_EQ(readPlainFile(dir.filePath(u"Mod0.bas"_qs)), QByteArray("old")) << signal;
    EXPECT_EQ(hiddenFiles(dir.path()).isEmpty(), signal != SIGKILL) << signal;
    writeFileAtomically(dir.filePath(u"Mod0.bas"_qs), "new");
    EXPECT_EQ(QDir(dir.path()).entryList(QDir::Files | QDir::Hidden), QStringList{u"Mod0.bas"_qs});
  }
}

}  // namespace
}  // namespace fileio
