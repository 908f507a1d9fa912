// SPDX-License-Identifier: MIT
// Tests of whole-file reads and atomic writes in a temporary directory: the error numbers and descriptions
// of each failure, and that a failed write leaves the old file as it was.
#include "host/files/fileio.h"

#include "ide/error.h"

#include <gtest/gtest.h>

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QTemporaryDir>

namespace host {
namespace {

template <typename Action>
ide::Error expectError(Action&& action) {
  try {
    action();
  } catch (const ide::Error& error) {
    return error;
  }
  ADD_FAILURE() << "no ide::Error thrown";
  return ide::Error(0, {});
}

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
}

TEST_F(FileIoTest, ReadsAnEmptyFile) {
  writePlainFile(path("empty.bas"), {});
  EXPECT_TRUE(readFileBytes(path("empty.bas")).isEmpty());
}

TEST_F(FileIoTest, MissingFileIsFileNotFound) {
  const QString missing = path("Missing.bas");
  const ide::Error error = expectError([&] { readFileBytes(missing); });
  EXPECT_EQ(error.number(), ide::err::FileNotFound);
  EXPECT_EQ(error.description(), QStringLiteral("File not found: ") + missing);
}

TEST_F(FileIoTest, DirectoryIsUnreadable) {
  ASSERT_TRUE(QDir(m_directory.path()).mkdir(QStringLiteral("Forms")));
  const ide::Error error = expectError([&] { readFileBytes(path("Forms")); });
  EXPECT_EQ(error.number(), ide::err::PathFileAccessError);
  EXPECT_TRUE(
      error.description().startsWith(QStringLiteral("Cannot read ") + path("Forms") + QStringLiteral(": ")))
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

TEST_F(FileIoTest, WriteCreatesAFile) {
  writeFileAtomically(path("New.bas"), "Attribute VB_Name = \"New\"\r\n");
  EXPECT_EQ(readPlainFile(path("New.bas")), QByteArray("Attribute VB_Name = \"New\"\r\n"));
}

TEST_F(FileIoTest, WriteReplacesTheContentAndLeavesNoTemporaryFile) {
  writePlainFile(path("Class1.cls"), "old content that is longer than the new one\r\n");
  writeFileAtomically(path("Class1.cls"), "new\r\n");
  EXPECT_EQ(readPlainFile(path("Class1.cls")), QByteArray("new\r\n"));
  EXPECT_EQ(QDir(m_directory.path()).entryList(QDir::Files), QStringList{QStringLiteral("Class1.cls")});
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

TEST_F(FileIoTest, WriteIntoMissingDirectoryFails) {
  const QString target = path("NoSuchFolder/Module1.bas");
  const ide::Error error = expectError([&] { writeFileAtomically(target, "x"); });
  EXPECT_EQ(error.number(), ide::err::PathFileAccessError);
  EXPECT_TRUE(error.description().startsWith(QStringLiteral("Cannot write ") + target + QStringLiteral(": ")))
      << error.what();
}

TEST(FileWriteBatchTest, ReplacesEveryFileOnCommitAndLeavesNoTemporaries) {
  QTemporaryDir dir;
  const QString a = dir.filePath(QStringLiteral("a.bas"));
  const QString b = dir.filePath(QStringLiteral("b.bas"));
  writePlainFile(a, "old a");
  QFile::setPermissions(a, QFileDevice::ReadOwner | QFileDevice::WriteOwner | QFileDevice::ReadGroup);
  {
    FileWriteBatch batch;
    batch.add(a, "new a");
    batch.add(b, "new b");
    EXPECT_EQ(readPlainFile(a), QByteArray("old a"));  // nothing is in place before the commit
    EXPECT_FALSE(QFile::exists(b));
    batch.commit();
  }
  EXPECT_EQ(readPlainFile(a), QByteArray("new a"));
  EXPECT_EQ(readPlainFile(b), QByteArray("new b"));
  EXPECT_EQ(QFile::permissions(a) & (QFileDevice::ReadOwner | QFileDevice::WriteOwner |
                                     QFileDevice::ReadGroup | QFileDevice::ReadOther),
            QFileDevice::ReadOwner | QFileDevice::WriteOwner | QFileDevice::ReadGroup);
  EXPECT_EQ(QDir(dir.path()).entryList(QDir::Files | QDir::Hidden).size(), 2);
}

TEST(FileWriteBatchTest, ABatchThatIsNotCommittedOrFailsChangesNothing) {
  QTemporaryDir dir;
  const QString a = dir.filePath(QStringLiteral("a.bas"));
  writePlainFile(a, "old a");
  {
    FileWriteBatch batch;
    batch.add(a, "new a");
  }  // abandoned
  EXPECT_EQ(readPlainFile(a), QByteArray("old a"));
  // A directory in the way of the second file: the first is not replaced either.
  const QString blocked = dir.filePath(QStringLiteral("b.bas"));
  ASSERT_TRUE(QDir().mkpath(blocked));
  FileWriteBatch batch;
  batch.add(a, "new a");
  const ide::Error error = expectError([&] { batch.add(blocked, "new b"); });
  EXPECT_EQ(error.number(), ide::err::PathFileAccessError);
  EXPECT_TRUE(error.description().contains(QStringLiteral("b.bas")));
  EXPECT_TRUE(batch.empty());
  EXPECT_EQ(readPlainFile(a), QByteArray("old a"));
  EXPECT_EQ(QDir(dir.path()).entryList(QDir::Files | QDir::Hidden).size(), 1);
}

TEST(FileWriteBatchTest, FilesAddedTogetherAreAllOrNothing) {
  QTemporaryDir dir;
  std::vector<std::pair<QString, QByteArray>> files;
  for (int i = 0; i < 12; ++i) {
    const QString path = dir.filePath(QStringLiteral("m%1.bas").arg(i));
    writePlainFile(path, "old");
    files.emplace_back(path, QByteArray("new ") + QByteArray::number(i));
  }
  ASSERT_TRUE(QDir().mkpath(dir.filePath(QStringLiteral("in-the-way.bas"))));
  files.emplace(files.begin() + 5, dir.filePath(QStringLiteral("in-the-way.bas")), QByteArray("x"));
  FileWriteBatch failing;
  const ide::Error error = expectError([&] { failing.addAll(files); });
  EXPECT_TRUE(error.description().contains(QStringLiteral("in-the-way.bas")));
  for (int i = 0; i < 12; ++i)
    EXPECT_EQ(readPlainFile(dir.filePath(QStringLiteral("m%1.bas").arg(i))), QByteArray("old"));
  EXPECT_EQ(QDir(dir.path()).entryList(QDir::Files | QDir::Hidden).size(), 12);  // no temporary left

  files.erase(files.begin() + 5);
  FileWriteBatch batch;
  batch.addAll(files);
  batch.commit();
  for (int i = 0; i < 12; ++i)
    EXPECT_EQ(readPlainFile(dir.filePath(QStringLiteral("m%1.bas").arg(i))),
              QByteArray("new ") + QByteArray::number(i));
}

TEST(FileWriteBatchTest, ALinkKeepsPointingAtTheFileThatGetsTheContent) {
  QTemporaryDir dir;
  const QString real = dir.filePath(QStringLiteral("real.bas"));
  const QString link = dir.filePath(QStringLiteral("link.bas"));
  writePlainFile(real, "old");
  ASSERT_TRUE(QFile::link(real, link));
  writeFileAtomically(link, "new");
  EXPECT_TRUE(QFileInfo(link).isSymLink());
  EXPECT_EQ(readPlainFile(real), QByteArray("new"));
}

}  // namespace
}  // namespace host
