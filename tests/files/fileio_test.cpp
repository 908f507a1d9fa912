// SPDX-License-Identifier: MIT
// Tests of whole-file reads and atomic writes in a temporary directory: the error numbers and descriptions
// of each failure, and that a failed write leaves the old file as it was.
#include "host/files/fileio.h"

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

namespace host {
namespace {

using testing::expectError;

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
  ASSERT_TRUE(QDir(m_directory.path()).mkdir(QStringLiteral("Forms")));
  const QString missing = path("Missing.bas");
  ide::Error error = expectError([&] { readFileBytes(missing); });
  EXPECT_EQ(error.number(), ide::err::FileNotFound);
  EXPECT_EQ(error.description(), QStringLiteral("File not found: ") + missing);

  error = expectError([&] { readFileBytes(path("Forms")); });
  EXPECT_EQ(error.number(), ide::err::PathFileAccessError);
  EXPECT_TRUE(error.description().startsWith(QStringLiteral("Cannot read %1: ").arg(path("Forms"))))
      << error.what();

  const QString target = path("NoSuchFolder/Module1.bas");
  error = expectError([&] { writeFileAtomically(target, "x"); });
  EXPECT_EQ(error.number(), ide::err::PathFileAccessError);
  EXPECT_TRUE(error.description().startsWith(QStringLiteral("Cannot write %1: ").arg(target)))
      << error.what();
}

TEST_F(FileIoTest, UnreadableFileIsAccessError) {
  const QString locked = path("Locked.frm");
  writePlainFile(locked, "VERSION 5.00\r\n");
  ASSERT_TRUE(QFile::setPermissions(locked, QFileDevice::Permissions()));
  if (!permissionsApply(locked)) GTEST_SKIP() << "permission bits do not apply to this user (root)";
  const ide::Error error = expectError([&] { readFileBytes(locked); });
  EXPECT_EQ(error.number(), ide::err::PathFileAccessError);
  EXPECT_TRUE(error.description().startsWith(QStringLiteral("Cannot read ") + locked + QStringLiteral(": ")))
      << error.what();
  EXPECT_GT(error.description().size(),
            (QStringLiteral("Cannot read ") + locked + QStringLiteral(": ")).size())
      << "the reason is given";
}

TEST_F(FileIoTest, WriteCreatesOrReplacesAFileAndLeavesNoTemporaryFile) {
  writeFileAtomically(path("New.bas"), "Attribute VB_Name = \"New\"\r\n");
  EXPECT_EQ(readPlainFile(path("New.bas")), QByteArray("Attribute VB_Name = \"New\"\r\n"));
  writePlainFile(path("Class1.cls"), "old content that is longer than the new one\r\n");
  writeFileAtomically(path("Class1.cls"), "new\r\n");
  EXPECT_EQ(readPlainFile(path("Class1.cls")), QByteArray("new\r\n"));
  EXPECT_EQ(QDir(m_directory.path()).entryList(QDir::Files),
            (QStringList{QStringLiteral("Class1.cls"), QStringLiteral("New.bas")}));
}

TEST_F(FileIoTest, WriteIntoReadOnlyDirectoryFailsAndKeepsTheOldFile) {
  const QString subdirectory = path("ReadOnly");
  ASSERT_TRUE(QDir(m_directory.path()).mkdir(QStringLiteral("ReadOnly")));
  const QString target = subdirectory + QStringLiteral("/Form1.frm");
  writePlainFile(target, "old\r\n");
  ASSERT_TRUE(QFile::setPermissions(subdirectory, QFileDevice::ReadOwner | QFileDevice::ExeOwner));
  const bool bound = !QFile(subdirectory + QStringLiteral("/probe")).open(QIODevice::WriteOnly);
  if (!bound) {
    QFile::remove(subdirectory + QStringLiteral("/probe"));
    QFile::setPermissions(subdirectory,
                          QFileDevice::ReadOwner | QFileDevice::WriteOwner | QFileDevice::ExeOwner);
    GTEST_SKIP() << "permission bits do not apply to this user (root)";
  }
  const ide::Error error = expectError([&] { writeFileAtomically(target, "new\r\n"); });
  QFile::setPermissions(subdirectory,
                        QFileDevice::ReadOwner | QFileDevice::WriteOwner | QFileDevice::ExeOwner);
  EXPECT_EQ(error.number(), ide::err::PathFileAccessError);
  EXPECT_TRUE(error.description().startsWith(QStringLiteral("Cannot write ") + target + QStringLiteral(": ")))
      << error.what();
  EXPECT_EQ(readPlainFile(target), QByteArray("old\r\n"));
  EXPECT_EQ(QDir(subdirectory).entryList(QDir::Files), QStringList{QStringLiteral("Form1.frm")});
}

TEST(FileWriteBatchTest, FilesAddedTogetherAreAllOrNothing) {
  QTemporaryDir dir;
  std::vector<FileWriteBatch::File> files;
  for (int i = 0; i < 12; ++i) {
    const QString path = dir.filePath(QStringLiteral("m%1.bas").arg(i));
    if (i > 0) writePlainFile(path, "old");  // m0.bas is new
    files.push_back({path, QByteArray("new ") + QByteArray::number(i), {}});
  }
  const auto expectOld = [&](const char* when) {
    EXPECT_FALSE(QFile::exists(files[0].path)) << when;
    for (std::size_t i = 1; i < files.size(); ++i)
      EXPECT_EQ(readPlainFile(files[i].path), QByteArray("old")) << when;
    EXPECT_EQ(QDir(dir.path()).entryList(QDir::Files | QDir::Hidden).size(), 11) << "a temporary is left";
  };
  ASSERT_TRUE(QDir().mkpath(dir.filePath(QStringLiteral("in-the-way.bas"))));
  std::vector<FileWriteBatch::File> withDirectory = files;
  withDirectory.insert(withDirectory.begin() + 5, {dir.filePath(QStringLiteral("in-the-way.bas")), "x", {}});
  FileWriteBatch failing;
  const ide::Error error = expectError([&] { failing.addAll(withDirectory); });
  EXPECT_TRUE(error.description().contains(QStringLiteral("in-the-way.bas")));
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
  return QDir(directory)
      .entryList(QDir::Files | QDir::Hidden | QDir::System)
      .filter(QStringLiteral(".quimbel-"));
}

TEST(FileWriteBatchTest, KeepsModeOwnerLinksAndRefusesAReadOnlyFile) {
  QTemporaryDir dir;
  const QString real = dir.filePath(QStringLiteral("Real.bas"));
  const QString chain = dir.filePath(QStringLiteral("l1.bas"));  // l1.bas -> sub/l2.bas -> ../Real.bas
  writePlainFile(real, "old");
  ASSERT_TRUE(QDir(dir.path()).mkdir(QStringLiteral("sub")));
  ASSERT_EQ(::symlink("../Real.bas", QFile::encodeName(dir.filePath(QStringLiteral("sub/l2.bas")))), 0);
  ASSERT_EQ(::symlink("sub/l2.bas", QFile::encodeName(chain)), 0);
  ASSERT_EQ(::chmod(QFile::encodeName(real), 0640), 0);
  const bool root = ::geteuid() == 0;
  if (root) {
    ASSERT_EQ(::chown(QFile::encodeName(real), 4321, 4322), 0);
  }
  const QString linked = dir.filePath(QStringLiteral("Linked.cls"));
  const QString other = dir.filePath(QStringLiteral("Other.cls"));
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
  EXPECT_TRUE(QFileInfo(chain).isSymLink() &&
              QFileInfo(dir.filePath(QStringLiteral("sub/l2.bas"))).isSymLink());
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
  EXPECT_EQ(error.description(), QStringLiteral("Cannot write %1: the file is read-only").arg(linked));
  EXPECT_EQ(readPlainFile(real), QByteArray("new real"));
  EXPECT_TRUE(hiddenFiles(dir.path()).isEmpty());
}

TEST(FileWriteBatchTest, AFailedRenamePutsBackWhatWasReplacedOrSaysWhichFilesHoldTheNewText) {
  for (const bool restoreFails : {false, true}) {
    QTemporaryDir dir;
    std::vector<FileWriteBatch::File> files;
    for (int i = 0; i < 6; ++i) {
      const QString path = dir.filePath(QStringLiteral("Mod%1.bas").arg(i));
      if (i != 1) writePlainFile(path, "old");  // Mod1.bas is new
      files.push_back({path, QByteArray("new ") + QByteArray::number(i), {}});
    }
    // Hard-linked: rewritten in place.
    ASSERT_EQ(::link(QFile::encodeName(files[2].path), QFile::encodeName(dir.filePath(QStringLiteral("x")))),
              0);
    setFileFaultHook([&](FileStep step, const QString& path) {
      if (step == FileStep::Replace && path.endsWith(QStringLiteral("Mod4.bas"))) return EIO;
      return step == FileStep::Restore && restoreFails && path.endsWith(QStringLiteral("Mod0.bas")) ? EIO : 0;
    });
    FileWriteBatch batch;
    batch.addAll(files);
    const QString description = expectError([&] { batch.commit(); }).description();
    setFileFaultHook({});
    EXPECT_TRUE(description.startsWith(QStringLiteral("Cannot write %1: ").arg(files[4].path)))
        << restoreFails;
    for (int i = 0; i < 6; ++i)
      EXPECT_EQ(readPlainFile(files[size_t(i)].path), i == 0 && restoreFails ? QByteArray("new 0")
                                                      : i == 1               ? QByteArray("<unreadable>")
                                                                             : QByteArray("old"))
          << i;
    EXPECT_EQ(batch.written(0) != nullptr, restoreFails);
    // The backup that holds the old text is the one file left, and the message names it.
    EXPECT_EQ(hiddenFiles(dir.path()).size(), restoreFails ? 1 : 0);
    EXPECT_EQ(description.contains(QStringLiteral("%1 holds the new text").arg(files[0].path)) &&
                  description.contains(hiddenFiles(dir.path()).value(0, QStringLiteral("?"))),
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
    const QString path = dir.filePath(QStringLiteral("Form1.frm"));
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
    files.push_back({dir.filePath(QStringLiteral("Mod%1.bas").arg(i)), QByteArray(300, 'x'), {}});
  return files;
}

TEST(FileWriteBatchTest, ABatchOfMoreFilesThanMayBeOpenAtOnceIsWritten) {
  // In memory where it can be: 1,500 flushes to a disk take seconds.
  const bool shm = QFileInfo(QStringLiteral("/dev/shm")).isWritable();
  QTemporaryDir dir(shm ? QStringLiteral("/dev/shm/quimbel-XXXXXX")
                        : QDir::tempPath() + QStringLiteral("/q-XXXXXX"));
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
    writePlainFile(dir.filePath(QStringLiteral("Mod0.bas")), "old");
    const int status = inChild(
        [&] {
          const rlimit limit{64, 64};  // flushed and named in groups of 16
          ::setrlimit(RLIMIT_NOFILE, &limit);
          setFileFaultHook([](FileStep, const QString& path) {
            if (path.endsWith(QStringLiteral("Mod60.bas"))) {
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
    EXPECT_EQ(readPlainFile(dir.filePath(QStringLiteral("Mod0.bas"))), QByteArray("old")) << signal;
    EXPECT_EQ(hiddenFiles(dir.path()).isEmpty(), signal != SIGKILL) << signal;
    writeFileAtomically(dir.filePath(QStringLiteral("Mod0.bas")), "new");
    EXPECT_EQ(QDir(dir.path()).entryList(QDir::Files | QDir::Hidden),
              QStringList{QStringLiteral("Mod0.bas")});
  }
}

}  // namespace
}  // namespace host
