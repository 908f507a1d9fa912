// SPDX-License-Identifier: MIT
// The application database on disk: what the sqlcipher shell sees in it, the rules of its operations,
// texts of every kind, files it cannot use, and other processes using it at the same time.
#include "appdata/appinfofile.h"
#include "ide/error.h"
#include "printers.h"

#include <gtest/gtest.h>

#include <QFile>
#include <QProcess>
#include <QTemporaryDir>
#include <QThread>

#include <functional>

namespace appdata::test {
namespace {

/// The shell's exit code and output.
std::pair<int, QString> sqlcipher(const QString& file, const QString& script) {
  QProcess shell;
  shell.setProcessChannelMode(QProcess::MergedChannels);
  shell.start(u"sqlcipher"_qs, {u"-batch"_qs, file});
  shell.write(script.toUtf8());
  shell.closeWriteChannel();
  shell.waitForFinished(30000);
  return {shell.exitCode(), QString::fromUtf8(shell.readAll())};
}

QByteArray contents(const QString& path) {
  QFile file(path);
  file.open(QIODevice::ReadOnly);
  return file.readAll();
}

/// The error `work` raised: {number, description}; {0, ""} when it raised none.
std::pair<long, QString> failureOf(const std::function<void()>& work) {
  try {
    work();
  } catch (const ide::Error& error) {
    return {error.number(), error.description()};
  }
  return {0, {}};
}

class AppInfoFileTest : public ::testing::Test {
 protected:
  QString file() const { return dir.filePath(u"Quimbel.inf"_qs); }
  QTemporaryDir dir;
};

TEST_F(AppInfoFileTest, TheShellSeesTheFourTablesOnlyWithThePassword) {
  {
    CAppInfoFile db;
    db.OpenFile(dir.path());
    db.GetNextProjId();
  }
  const auto [keyedExit, keyed] =
      sqlcipher(file(), QStringLiteral("PRAGMA key = '$468$468$468'; PRAGMA kdf_iter = 4000;\n"
                                       "PRAGMA table_info(Macros); PRAGMA table_info(CopyBuffers);\n"
                                       "PRAGMA table_info(CodeChunks); PRAGMA table_info(ProjIds);\n"
                                       "SELECT 'id ' || ProjId FROM ProjIds;\n"));
  QStringList columns;
  for (const QString& line : keyed.split(u'\n'))
    if (line.count(u'|') == 5) columns << line.section(u'|', 1, 4);
  EXPECT_EQ(columns,
            QStringList({u"MacroId|VARCHAR(20)|0|"_qs, u"Text|TEXT|0|"_qs, u"Enabled|BOOLEAN|0|"_qs,
                         u"CopyBufferId|VARCHAR(20)|0|"_qs, u"Text|TEXT|0|"_qs, u"Enabled|BOOLEAN|0|1"_qs,
                         u"Name|VARCHAR(40)|1|"_qs, u"Text|TEXT|0|"_qs, u"ProjId|INTEGER|0|"_qs}))
      << keyed.toStdString();
  EXPECT_EQ(keyedExit, 0);
  EXPECT_TRUE(keyed.contains(u"id 1\n"_qs)) << keyed.toStdString();

  const auto [bareExit, bare] = sqlcipher(file(), u"SELECT count(*) FROM sqlite_master;\n"_qs);
  EXPECT_NE(bareExit, 0);
  EXPECT_TRUE(bare.contains(u"not a database"_qs)) << bare.toStdString();
}

TEST_F(AppInfoFileTest, RowsAreAddedChangedAndFoundByTheirRules) {
  CAppInfoFile db;
  db.OpenFile(u"  "_qs + dir.path() + u"/ "_qs);
  EXPECT_EQ(db.FilePath(), file());
  // A first read adds the row enabled, and says so; keys compare without regard to case.
  EXPECT_TRUE(db.GetMacroState(u"Ctrl+Alt+A"_qs));
  EXPECT_EQ(db.GetMacroText(u"ctrl+alt+a"_qs), QString());
  EXPECT_EQ(db.GetCopyBufferText(u"Ctrl+1"_qs), QString());
  EXPECT_TRUE(db.GetCopyBufferState(u"Ctrl+1"_qs));
  // A state goes only to a row that exists; a text adds the row, enabled.
  const auto missing = failureOf([&] { db.WriteMacroState(u"Ctrl+Shift+Q"_qs, false); });
  EXPECT_EQ(missing.first, kAppDataError);
  EXPECT_TRUE(missing.second.startsWith(file())) << missing.second.toStdString();
  db.WriteMacroText(u"Ctrl+Shift+Q"_qs, u"q"_qs);
  EXPECT_TRUE(db.GetMacroState(u"Ctrl+Shift+Q"_qs));
  db.WriteMacroState(u"CTRL+ALT+A"_qs, false);
  db.WriteCopyBufferText(u"Ctrl+1"_qs, u"buffer"_qs);
  db.WriteCopyBufferState(u"Ctrl+1"_qs, false);
  // Templates are the stock ones until written.
  EXPECT_EQ(db.GetDefErrorHandler().split(u'\n').value(4),
            u"\t' tirar proveito do valor retornado  por  Erl. Sem "_qs);
  EXPECT_EQ(db.GetProcDocHeader().split(u'\n').value(6), u"' "_qs + QString(53, u'*'));
  EXPECT_EQ(db.GetModuleDocHeader(), QString());
  db.WriteDefErrorHandler(u"\tResume Next"_qs);
  db.WriteDefErrorHandler(u"\tResume Next\r\n"_qs);
  db.WriteModuleDocHeader(u"' {ModuleName}"_qs);
  EXPECT_EQ(db.GetNextProjId(), u"000001"_qs);
  EXPECT_EQ(db.GetNextProjId(), u"000002"_qs);

  CAppInfoFile again;
  again.OpenFile(dir.path());
  EXPECT_FALSE(again.GetMacroState(u"Ctrl+Alt+A"_qs));
  EXPECT_EQ(again.GetMacroText(u"Ctrl+Shift+Q"_qs), u"q"_qs);
  EXPECT_FALSE(again.GetCopyBufferState(u"Ctrl+1"_qs));
  EXPECT_EQ(again.GetCopyBufferText(u"Ctrl+1"_qs), u"buffer"_qs);
  EXPECT_EQ(again.GetDefErrorHandler(), u"\tResume Next\r\n"_qs);
  EXPECT_EQ(again.GetModuleDocHeader(), u"' {ModuleName}"_qs);
  EXPECT_EQ(again.GetNextProjId(), u"000003"_qs);
}

TEST_F(AppInfoFileTest, TextsOfAnyLengthAndCharacterComeBackUnchangedOrAreRefused) {
  const QString texts[] = {u"MsgBox \"it's \"\"done\"\"\" ' {C}"_qs,
                           u"10 a\r\n\r\nb\nc\r"_qs,
                           QString::fromUtf16(u"x\0y\0", 4),
                           u"Ω 中文 😀 \u0081 € ÿ"_qs,
                           QString(1'000'000, u'é'),
                           QString()};
  {
    CAppInfoFile db;
    db.OpenFile(dir.path());
    for (int i = 0; i < 6; ++i)
      db.WriteCopyBufferText(u"Ctrl+%1"_qs.arg(i), texts[i]);
    db.WriteMacroText(u"Ctrl+Alt+B"_qs, texts[1]);
    // Half a surrogate pair is not text: refused, and what was there stays.
    const QString broken = QChar(0xD800) + u"x"_qs;
    EXPECT_EQ(failureOf([&] { db.WriteMacroText(u"Ctrl+Alt+B"_qs, broken); }).first, kAppDataError);
    const auto refused = failureOf([&] { db.WriteDefErrorHandler(broken); });
    EXPECT_EQ(refused.first, kAppDataError);
    EXPECT_TRUE(refused.second.contains(u"Unicode"_qs)) << refused.second.toStdString();
  }
  CAppInfoFile db;
  db.OpenFile(dir.path());
  for (int i = 0; i < 6; ++i)
    EXPECT_EQ(db.GetCopyBufferText(u"Ctrl+%1"_qs.arg(i)), texts[i]) << i;
  EXPECT_EQ(db.GetMacroText(u"Ctrl+Alt+B"_qs), texts[1]);
  EXPECT_EQ(db.GetDefErrorHandler(), CAppInfoFile::DefaultErrorHandler());
}

TEST_F(AppInfoFileTest, AFileThatCannotBeUsedIsNamedAndLeftAsItWas) {
  CAppInfoFile missing;
  const auto noPath = failureOf([&] { missing.OpenFile(u"   "_qs); });
  EXPECT_EQ(noPath, std::make_pair(kAppDataError, u"No installation path information."_qs));
  EXPECT_EQ(failureOf([&] { missing.GetNextProjId(); }).first, kAppDataError);

  {
    CAppInfoFile db;
    db.OpenFile(dir.path());
    db.WriteMacroText(u"Ctrl+Alt+A"_qs, QString(20'000, u'x'));
  }
  const QByteArray good = contents(file());
  const QString otherKey = dir.filePath(u"other.db"_qs);
  sqlcipher(otherKey, u"PRAGMA key = 'outra senha'; CREATE TABLE Macros (MacroId);\n"_qs);
  const struct {
    QByteArray bytes;
    QString reason;
  } cases[] = {{contents(otherKey), u"outra senha"_qs},
               {"VERSION 5.00\r\nBegin VB.Form frmMain\r\n", u"não é um banco de dados"_qs},
               {good.left(good.size() / 2), u"danificado"_qs},
               {good.left(700), u"não é um banco de dados"_qs},
               {{}, u"não tem as tabelas"_qs}};
  for (const auto& bad : cases) {
    QFile out(file());
    ASSERT_TRUE(out.open(QIODevice::WriteOnly | QIODevice::Truncate));
    out.write(bad.bytes);
    out.close();
    CAppInfoFile db;
    EXPECT_EQ(failureOf([&] { db.OpenFile(dir.path()); }),
              std::make_pair(kAppDataError, u"Initialization error."_qs));
    EXPECT_FALSE(db.IsOpen());
    EXPECT_TRUE(db.UnavailableMessage().contains(file() + u": "_qs) &&
                db.UnavailableMessage().contains(bad.reason))
        << db.UnavailableMessage().toStdString();
    EXPECT_EQ(contents(file()), bad.bytes) << bad.reason.toStdString();
  }
}

// The four tables as another tool makes them from their description: no collation, keys as typed.
constexpr char kPlainSchema[] =
    "CREATE TABLE Macros (MacroId VARCHAR(20), Text TEXT, Enabled BOOLEAN);"
    "CREATE TABLE CopyBuffers (CopyBufferId VARCHAR(20), Text TEXT, Enabled BOOLEAN DEFAULT 1);"
    "CREATE TABLE CodeChunks (Name VARCHAR(40) NOT NULL, Text TEXT);"
    "CREATE TABLE ProjIds (ProjId INTEGER PRIMARY KEY AUTOINCREMENT);"
    "INSERT INTO Macros VALUES ('CTRL+ALT+D', 'Debug.Print', 1);";

TEST_F(AppInfoFileTest, KeysInAnotherToolsFileAreFoundWithoutRegardToCase) {
  const QString key = u"PRAGMA key = '$468$468$468'; PRAGMA kdf_iter = 4000;\n"_qs;
  sqlcipher(file(), key + QLatin1StringView(kPlainSchema) + u'\n');
  {
    CAppInfoFile db;
    db.OpenFile(dir.path());
    EXPECT_EQ(db.GetMacroText(u"Ctrl+Alt+D"_qs), u"Debug.Print"_qs);
    db.WriteMacroText(u"ctrl+alt+d"_qs, u"Stop"_qs);
  }
  EXPECT_EQ(sqlcipher(file(), key + u"SELECT MacroId, Text FROM Macros;\n"_qs).second,
            u"CTRL+ALT+D|Stop\n"_qs);
}

/// A program's exit code and output.
std::pair<int, QString> run(const QString& program, const QStringList& arguments) {
  QProcess process;
  process.setProcessChannelMode(QProcess::MergedChannels);
  process.start(program, arguments);
  process.waitForFinished(60000);
  return {process.exitCode(), QString::fromUtf8(process.readAll())};
}

#ifdef QUIMBEL_SQLCIPHER4_ORACLE
TEST_F(AppInfoFileTest, SqlCipher4ReadsAndWritesTheFileWithThePinnedSettingsAsOurCodeDoesOnIt) {
  const QString oracle = QStringLiteral(QUIMBEL_SQLCIPHER4_ORACLE);
  const QString worker4 = QStringLiteral(QUIMBEL_APPDATA_WORKER_SQLCIPHER4);
  const QStringList pinned = {u"PRAGMA key = '$468$468$468'"_qs, u"PRAGMA cipher_page_size = 1024"_qs,
                              u"PRAGMA kdf_iter = 4000"_qs, u"PRAGMA cipher_hmac_algorithm = HMAC_SHA1"_qs,
                              u"PRAGMA cipher_kdf_algorithm = PBKDF2_HMAC_SHA1"_qs};
  const QString select = u"SELECT Text FROM Macros"_qs;
  {
    CAppInfoFile db;
    db.OpenFile(dir.path());
    db.WriteMacroText(u"Ctrl+Alt+E"_qs, u"Olá"_qs);
  }
  const auto read = run(oracle, QStringList{file()} + pinned + QStringList{select});
  EXPECT_TRUE(read.first == 0 && read.second.endsWith(u"Olá\n"_qs)) << read.second.toStdString();
  // What the README tells SQLCipher 4's users reads it too; SQLCipher 4's own defaults do not.
  const auto documented = run(oracle, {file(), pinned[0], u"PRAGMA cipher_compatibility = 3"_qs,
                                       u"PRAGMA kdf_iter = 4000"_qs, select});
  EXPECT_TRUE(documented.second.endsWith(u"Olá\n"_qs)) << documented.second.toStdString();
  EXPECT_NE(run(oracle, {file(), pinned[0], select}).first, 0);
  // Our code built on SQLCipher 4 shares the file with ours on SQLCipher 3, and the reverse.
  EXPECT_EQ(run(worker4, {dir.path(), u"ids"_qs, u"1"_qs}), std::make_pair(0, u"000001\n"_qs));
  QTemporaryDir fromFour;
  EXPECT_EQ(run(worker4, {fromFour.path(), u"ids"_qs, u"1"_qs}), std::make_pair(0, u"000001\n"_qs));
  for (const QString& folder : {dir.path(), fromFour.path()}) {
    CAppInfoFile db;
    db.OpenFile(folder);
    EXPECT_EQ(db.GetNextProjId(), u"000002"_qs);
  }
  // A file SQLCipher 4 made with the pinned settings, from the tables' description, is ours to use.
  QTemporaryDir other;
  const auto written = run(oracle, QStringList{other.filePath(u"Quimbel.inf"_qs)} + pinned +
                                       QStringList{QLatin1StringView(kPlainSchema)});
  EXPECT_EQ(written.first, 0) << written.second.toStdString();
  CAppInfoFile db;
  db.OpenFile(other.path());
  EXPECT_EQ(db.GetMacroText(u"Ctrl+Alt+D"_qs), u"Debug.Print"_qs);
}
#else
TEST_F(AppInfoFileTest, SqlCipher4ReadsAndWritesTheFileWithThePinnedSettingsAsOurCodeDoesOnIt) {
  GTEST_SKIP() << "SQLCipher 4's amalgamation was not built in (scripts/fetch-sqlcipher4.sh fetches it)";
}
#endif

TEST_F(AppInfoFileTest, ProcessesDrawingIdentifiersAtOnceNeverGetTheSameOne) {
  CAppInfoFile db;
  db.OpenFile(dir.path());
  QProcess first, second;
  for (QProcess* worker : {&first, &second})
    worker->start(QStringLiteral(QUIMBEL_APPDATA_WORKER), {dir.path(), u"ids"_qs, u"40"_qs});
  // This process draws as an IDE would, between other work; the two workers draw as fast as they can.
  QStringList ids;
  while (ids.size() < 10 || first.state() != QProcess::NotRunning || second.state() != QProcess::NotRunning) {
    ids << db.GetNextProjId();
    first.waitForFinished(2);
    second.waitForFinished(2);
  }
  for (QProcess* worker : {&first, &second}) {
    EXPECT_EQ(worker->exitCode(), 0) << worker->readAllStandardError().toStdString();
    ids << QString::fromLatin1(worker->readAllStandardOutput()).split(u'\n', Qt::SkipEmptyParts);
  }
  ids.sort();
  QStringList expected;
  for (int id = 1; id <= ids.size(); ++id)
    expected << u"%1"_qs.arg(id, 6, 10, QChar(u'0'));
  EXPECT_EQ(ids, expected);
}

TEST_F(AppInfoFileTest, AProcessKilledWhileWritingLeavesTheOldOrTheNewText) {
  for (const int delayMs : {0, 15, 40}) {
    QProcess writer;
    writer.start(QStringLiteral(QUIMBEL_APPDATA_WORKER), {dir.path(), u"write"_qs, u"1000"_qs});
    ASSERT_TRUE(writer.waitForReadyRead(30000));
    QThread::msleep(delayMs);
    writer.kill();
    writer.waitForFinished();
    const int committed =
        QString::fromLatin1(writer.readAllStandardOutput()).split(u'\n', Qt::SkipEmptyParts).last().toInt();
    CAppInfoFile db;
    db.OpenFile(dir.path());
    const QString text = db.GetMacroText(u"Ctrl+Alt+A"_qs);
    const auto version = [](int n) { return QString(300'000, QChar(u'a' + n % 26)) + QString::number(n); };
    EXPECT_TRUE(text == version(committed) || text == version(committed + 1))
        << "after " << committed << ": " << text.right(5).toStdString();
  }
}

}  // namespace
}  // namespace appdata::test
