// SPDX-License-Identifier: MIT
// The compound-file layer: the typed stream layout byte for byte, storages and their elements, files that
// are damaged or held by another program, independent readers (olefile, libgsf) and a writer killed in
// the middle of its commits.
#include "gsforacle.h"
#include "printers.h"
#include "projinfo/records.h"
#include "projinfo/storage/mdlstorage.h"
#include "testproject.h"

#include <gtest/gtest.h>

#include <QDir>
#include <QFile>
#include <QProcess>
#include <QRandomGenerator>
#include <QTemporaryDir>
#include <QThread>
#include <QtEndian>

#include <csignal>

namespace projinfo {
namespace {

using host::test::readBytes;
using host::test::writeBytes;

/// The failure number of `action` (0 when it does not fail).
long failure(const std::function<void()>& action, QString* description = nullptr) {
  return host::test::errorNumberOf(action, description);
}

std::shared_ptr<Storage> createFile(const QString& path) {
  bool isNew = true;
  return OpenOrCreateDocFile(path, isNew, true, false);
}

/// A file with two task records, committed.
void writeSample(const QString& path) {
  auto root = createFile(path);
  auto tasks = root->CreateStorage(u"TaskList"_qs, kElementMode);
  for (int id : {1, 2})
    tasks->CreateStream(u"Task%1"_qs.arg(id), kElementMode)
        ->WriteData(TaskRecord{u"Revisar cálculo %1"_qs.arg(id), {}, id == 2, id}.toText());
  root->CreateStream(u"LastTaskId"_qs, kElementMode)->WriteData(2);
  root->Commit(0);
}

TEST(StreamLayout, EachTypeIsWrittenByteForByteAndReadBack) {
  QTemporaryDir dir;
  auto root = createFile(dir.filePath(u"a.qmi"_qs));
  const struct {
    QVariant value;
    qint32 code;
    QByteArray bytes;
  } kCases[] = {
      {QVariant::fromValue(qint16(-2)), vbInteger, "\xFE\xFF"},
      {QVariant::fromValue(qint32(0x01020304)), vbLong, "\x04\x03\x02\x01"},
      {QVariant::fromValue(1.0f), vbSingle, QByteArray("\x00\x00\x80\x3F", 4)},
      {QVariant::fromValue(1.5), vbDouble, QByteArray("\x00\x00\x00\x00\x00\x00\xF8\x3F", 8)},
      {QVariant::fromValue(Currency{12345}), vbCurrency, QByteArray("\x39\x30\x00\x00\x00\x00\x00\x00", 8)},
      {QVariant::fromValue(dateFromAutomation(2.5)), vbDate,
       QByteArray("\x00\x00\x00\x00\x00\x00\x04\x40", 8)},
      {QVariant::fromValue(dateFromAutomation(-1.25)), vbDate,
       QByteArray("\x00\x00\x00\x00\x00\x00\xF4\xBF", 8)},
      {QVariant::fromValue(QString()), vbString, QByteArray(4, '\0')},
      {QVariant::fromValue(u"abc"_qs), vbString, QByteArray("\x03\x00\x00\x00\x61\x00\x62\x00\x63\x00", 10)},
      {QVariant::fromValue(u"é😀"_qs), vbString, QByteArray("\x03\x00\x00\x00\xE9\x00\x3D\xD8\x00\xDE", 10)},
      {QVariant::fromValue(true), vbBoolean, "\xFF\xFF"},
      {QVariant::fromValue(false), vbBoolean, QByteArray(2, '\0')},
  };
  for (const auto& c : kCases) {
    auto stream = root->CreateStream(u"Value"_qs, kElementMode);
    stream->SetSize(0);
    EXPECT_GT(stream->WriteData(c.value), 0) << c.value.typeName();
    EXPECT_EQ(stream->StreamInterface().element->data.toHex(' '), c.bytes.toHex(' ')) << c.value.typeName();
    stream->SSeek(0);
    EXPECT_EQ(stream->ReadData(c.code), c.value);
  }
  // Bytes are written but not read; types without a layout write nothing; 01 00 is true.
  auto stream = root->CreateStream(u"Other"_qs, kElementMode);
  EXPECT_EQ(stream->WriteData(QVariant::fromValue(uchar(7))), 1);
  EXPECT_EQ(stream->WriteData(QVariant::fromValue(qint64(7))), 0);
  EXPECT_EQ(stream->WriteBuf(QByteArray("\x01\x00", 2)), 2);
  stream->SSeek(0);
  EXPECT_FALSE(stream->ReadData(vbByte).isValid());
  EXPECT_EQ(stream->position(), 0);
  stream->SSeek(1);
  EXPECT_EQ(stream->ReadData(vbBoolean), QVariant(true));
}

TEST(StreamLayout, AStringCountTheStreamCannotHoldIsDamage) {
  QTemporaryDir dir;
  auto root = createFile(dir.filePath(u"a.qmi"_qs));
  const QByteArray kBad[] = {
      QByteArray("\xFF\xFF\xFF\xFF", 4),                  // negative
      QByteArray("\x05\x00\x00\x00\x61\x00", 6),          // five characters, one there
      QByteArray("\xFF\xFF\xFF\x7F\x61\x00\x62\x00", 8),  // far more than the stream
      QByteArray("\x02\x00", 2),                          // the count itself cut short
  };
  for (const QByteArray& bytes : kBad) {
    auto stream = root->CreateStream(u"Bad"_qs, kElementMode);
    stream->SetSize(0);
    stream->WriteBuf(bytes);
    stream->SSeek(0);
    EXPECT_EQ(failure([&] { stream->ReadData(vbString); }), stg::ReadFault) << bytes.toHex().constData();
    EXPECT_EQ(stream->position(), 0);
  }
}

TEST(StreamLayout, ADateOutsideTheYears100To9999IsRefused) {
  QTemporaryDir dir;
  auto stream = createFile(dir.filePath(u"a.qmi"_qs))->CreateStream(u"Date"_qs, kElementMode);
  for (const double days : {-657434.5, 2958465.99, -657435.0, 2958466.0, 1e300, -1e300, qQNaN(), qInf()}) {
    const bool inRange = days > -657435 && days < 2958466;
    EXPECT_EQ(dateFromAutomation(days).isValid(), inRange) << days;
    stream->SetSize(0);
    stream->SSeek(0);
    stream->WriteData(days);
    stream->SSeek(0);
    EXPECT_EQ(failure([&] { stream->ReadData(vbDate); }), inRange ? 0 : 6) << days;
  }
}

TEST(Storages, ElementsAreCreatedOpenedListedMovedAndDestroyed) {
  QTemporaryDir dir;
  auto root = createFile(dir.filePath(u"a.qmi"_qs));
  auto list = root->CreateStorage(u"TaskList"_qs, kElementMode);
  EXPECT_EQ(list->Elements().Count(), 0);
  EXPECT_EQ(list->Parent, root);
  for (const char* name : {"Task10", "Task2", "Task1"})
    list->CreateStream(QLatin1StringView(name), kElementMode)->WriteData(u"longer text"_qs);
  // An existing stream opens at its start; writing overwrites from there.
  auto again = list->CreateStream(u"TASK2"_qs, kElementMode);
  EXPECT_EQ(again->position(), 0);
  again->WriteData(u"x"_qs);
  again->SSeek(0);
  EXPECT_EQ(again->ReadData(vbString), QVariant(u"x"_qs));
  QStringList names;
  for (const VBSTATSTG& element : list->Elements())
    names << element.Name();
  EXPECT_EQ(names, (QStringList{u"Task1"_qs, u"Task2"_qs, u"Task10"_qs})) << "shorter names first";
  EXPECT_EQ(list->Stat().StorageType(), 1);
  EXPECT_EQ(list->Elements().Item(1).StorageType(), 2);
  EXPECT_EQ(failure([&] { list->Elements().Item(4); }), ide::err::SubscriptOutOfRange);

  list->RenameElement(u"Task10"_qs, u"Task3"_qs);
  list->MoveElementTo(u"Task3"_qs, root, u"Copy"_qs, STGMOVE_COPY);
  list->MoveElementTo(u"Task1"_qs, root, u"Moved"_qs, STGMOVE_MOVE);
  list->DestroyElement(u"Task2"_qs);
  EXPECT_EQ(failure([&] { again->ReadData(vbString); }), stg::Reverted) << "its element was destroyed";
  EXPECT_EQ(failure([&] { list->OpenStream(u"Task1"_qs, kElementMode); }), stg::FileNotFound);
  EXPECT_EQ(failure([&] { root->CreateStream(u"TaskList"_qs, kElementMode); }), stg::FileAlreadyExists);
  EXPECT_EQ(failure([&] { root->CreateStream(u"a/b"_qs, kElementMode); }), stg::InvalidName);
  EXPECT_EQ(failure([&] { list->MoveElementTo(u"Task3"_qs, list, u"Task3"_qs, 0); }), stg::FileAlreadyExists);
  EXPECT_EQ(root->OpenStream(u"Copy"_qs, kElementMode)->ReadData(vbString), QVariant(u"longer text"_qs));

  // A revert goes back to the last commit.
  root->Commit(0);
  root->CreateStream(u"Later"_qs, kElementMode);
  root->Revert();
  EXPECT_EQ(failure([&] { root->OpenStream(u"Later"_qs, kElementMode); }), stg::FileNotFound);
  EXPECT_EQ(failure([&] { list->Elements(); }), stg::Reverted);
  EXPECT_EQ(root->OpenStorage(u"TaskList"_qs, kElementMode)->Elements().Count(), 1);
}

TEST(DocFiles, AnExistingFileIsOpenedAsItIsAndHeldByItsFirstWriter) {
  QTemporaryDir dir;
  const QString path = dir.filePath(u"qm000001.qmi"_qs);
  writeSample(path);
  const QByteArray before = readBytes(path);
  bool isNew = true;
  auto root = OpenOrCreateDocFile(path, isNew, true, false);
  EXPECT_FALSE(isNew);
  QString why;
  bool secondIsNew = true;
  auto second = OpenOrCreateDocFile(path, secondIsNew, true, false);
  EXPECT_EQ(failure([&] { second->Elements(); }, &why), stg::LockViolation);
  EXPECT_TRUE(why.contains(path) && why.contains(u"in use by"_qs)) << why.toStdString();
  // A reader sees the last commit while the writer works.
  auto tasks = root->OpenStorage(u"TaskList"_qs, kElementMode);
  tasks->DestroyElement(u"Task1"_qs);
  EXPECT_EQ(OpenDocFileForReading(path)->OpenStorage(u"TaskList"_qs, 0)->Elements().Count(), 2);
  tasks.reset();  // destroying a storage commits
  EXPECT_NE(readBytes(path), before);
  EXPECT_EQ(OpenDocFileForReading(path)->OpenStorage(u"TaskList"_qs, 0)->Elements().Count(), 1);
  EXPECT_TRUE(QFile::exists(dir.filePath(u".qm000001.qmi.lock"_qs)));
  root.reset();
  EXPECT_FALSE(QFile::exists(dir.filePath(u".qm000001.qmi.lock"_qs)));
}

/// Where the directory of a file we wrote begins (its sectors follow each other).
qsizetype directoryOf(const QByteArray& file) {
  return (qsizetype(qFromLittleEndian<quint32>(file.constData() + 0x30)) + 1) * 512;
}

std::shared_ptr<Element> storageNamed(const QString& name) {
  auto storage = std::make_shared<Element>();
  storage->name = name;
  storage->kind = ElementKind::Storage;
  return storage;
}

/// A file whose storages nest `depth` deep: written side by side, then linked each into the one before.
QByteArray nested(int depth) {
  Element root;
  root.kind = ElementKind::Root;
  for (int i = 0; i < depth; ++i)
    root.children.emplace(ElementKey(u"S%1"_qs.arg(i)), storageNamed(u"S%1"_qs.arg(i)));
  QByteArray bytes = writeCompoundFile(root);
  for (int i = 0; i <= depth; ++i) {
    char* entry = bytes.data() + directoryOf(bytes) + 128 * qsizetype(i);
    qToLittleEndian<quint64>(~quint64(0), entry + 0x44);
    qToLittleEndian<quint32>(i < depth ? i + 1 : 0xFFFFFFFFu, entry + 0x4C);
  }
  return bytes;
}

/// Every element of a tree by its path, with its data.
QStringList contentsOf(const Element& element, const QString& path = {}) {
  QStringList all;
  for (const auto& [key, child] : element.children)
    all << path + child->name + u' ' + QString::fromLatin1(child->data.toHex())
        << contentsOf(*child, path + child->name + u'/');
  return all;
}

TEST(DocFiles, TreesNestAsDeepAsTheLimitAndAnyDeeperOneIsRefusedWithoutRecursion) {
  Element root;
  root.kind = ElementKind::Root;
  Element* deepest = &root;
  for (int depth = 1; depth <= kMaxNesting; ++depth)
    deepest = deepest->children.emplace(ElementKey(u"S"_qs), storageNamed(u"S"_qs)).first->second.get();
  EXPECT_EQ(contentsOf(*readCompoundFile(writeCompoundFile(root))), contentsOf(root));
  deepest->children.emplace(ElementKey(u"S"_qs), storageNamed(u"S"_qs));
  EXPECT_EQ(failure([&] { writeCompoundFile(root); }), stg::WriteFault);
  // A tree far deeper than any stack goes as a whole.
  for (int depth = 0; depth < 200000; ++depth)
    deepest = deepest->children.emplace(ElementKey(u"S"_qs), storageNamed(u"S"_qs)).first->second.get();
}

TEST(DocFiles, AnyTreeLinkCutOrBentIsDamageNeverALostElement) {
  QTemporaryDir dir;
  writeSample(dir.filePath(u"good.qmi"_qs));
  const QByteArray sample = readBytes(dir.filePath(u"good.qmi"_qs));
  const QStringList contents = contentsOf(*readCompoundFile(sample));
  int refused = 0;
  for (qsizetype offset = 0; offset + 4 <= sample.size(); offset += 4) {
    std::shared_ptr<Element> read;
    if (failure([&] { read = readCompoundFile(QByteArray(sample).replace(offset, 4, "\xFF\xFF\xFF\xFF")); }))
      ++refused;
    else
      EXPECT_EQ(contentsOf(*read).size(), contents.size()) << "offset " << offset;
  }
  EXPECT_GT(refused, 0);
}

TEST(DocFiles, DamagedFilesAreRefusedWithAReasonAndLeftAsTheyAre) {
  QTemporaryDir dir;
  const QString good = dir.filePath(u"good.qmi"_qs);
  writeSample(good);
  const QByteArray sample = readBytes(good);
  auto patched = [&](int offset, QByteArray bytes) {
    return QByteArray(sample).replace(offset, bytes.size(), bytes);
  };
  const qsizetype root = directoryOf(sample);
  const struct {
    const char* what;
    QByteArray bytes;
    long number;
  } kCases[] = {
      {"storages nested 30,000 deep", nested(30000), stg::DocFileCorrupt},
      {"the root's children cut off", patched(root + 0x4C, QByteArray(4, '\xFF')), stg::DocFileCorrupt},
      {"empty", {}, stg::InvalidHeader},
      {"text", "Type=Exe\r\nName=\"Loja\"\r\n", stg::InvalidHeader},
      {"cut in the header", sample.left(300), stg::DocFileCorrupt},
      {"cut after the header", sample.left(512), stg::DocFileCorrupt},
      {"cut in the data", sample.left(sample.size() - 700), stg::DocFileCorrupt},
      {"unknown version", patched(0x1A, QByteArray("\x07\x00", 2)), stg::DocFileCorrupt},
      {"directory sector out of the file", patched(0x30, QByteArray("\x00\x01\x00\x00", 4)),
       stg::DocFileCorrupt},
      {"directory chain in a circle", patched(512 + 4 * 1, QByteArray("\x01\x00\x00\x00", 4)),
       stg::DocFileCorrupt},
  };
  for (const auto& c : kCases) {
    const QString path = dir.filePath(u"bad.qmi"_qs);
    writeBytes(path, c.bytes);
    QString why;
    bool isNew = true;
    auto root = OpenOrCreateDocFile(path, isNew, true, false);
    EXPECT_EQ(failure([&] { root->CreateStorage(u"TaskList"_qs, kElementMode); }, &why), c.number)
        << c.what << ": " << why.toStdString();
    EXPECT_TRUE(why.contains(path)) << c.what;
    root.reset();
    EXPECT_EQ(readBytes(path), c.bytes) << c.what;
  }
}

// ---------------------------------------------------------------------------------------------------
// Independent readers and writers

/// Runs a Python program with Debian's olefile; empty when it is not installed.
std::optional<QString> olefile(const QString& program, const QStringList& arguments) {
  QProcess python;
  python.start(u"/usr/bin/python3"_qs, QStringList{u"-c"_qs, program} + arguments);
  if (!python.waitForFinished(30000) || python.exitCode() == 3) return std::nullopt;
  EXPECT_EQ(python.exitCode(), 0) << python.readAllStandardError().toStdString();
  return QString::fromUtf8(python.readAllStandardOutput());
}

constexpr char kOlefileProgram[] = R"(
import struct, sys
try:
    import olefile
except ImportError:
    sys.exit(3)
path = sys.argv[1]
ole = olefile.OleFileIO(path, raise_defects=olefile.DEFECT_INCORRECT)
for entry in ole.listdir(streams=True, storages=True):
    print('/'.join(entry))
data = ole.openstream('TaskList/Task2').read()
count = struct.unpack('<i', data[:4])[0]
print(data[4:4 + 2 * count].decode('utf-16-le'))
print('codepage', ole.get_metadata().codepage)
ole.close()
if len(sys.argv) > 2:
    ole = olefile.OleFileIO(path, write_mode=True)
    ole.write_stream('TaskList/Task2', data.replace('Revisar'.encode('utf-16-le'), 'Conferi'.encode('utf-16-le')))
    ole.close()
)";

TEST(Interop, OlefileReadsWhatWeWriteAndWeReadWhatItRewrote) {
  QTemporaryDir dir;
  const QString path = dir.filePath(u"qm000001.qmi"_qs);
  writeSample(path);
  const auto listing = olefile(QString::fromLatin1(kOlefileProgram), {path, u"rewrite"_qs});
  if (!listing) GTEST_SKIP() << "python3-olefile is not installed";
  EXPECT_EQ(listing->split(u'\n', Qt::SkipEmptyParts),
            (QStringList{u"\x05"
                         "DocumentSummaryInformation"_qs,
                         u"\x05SummaryInformation"_qs, u"LastTaskId"_qs, u"TaskList"_qs, u"TaskList/Task1"_qs,
                         u"TaskList/Task2"_qs, TaskRecord{u"Revisar cálculo 2"_qs, {}, true, 2}.toText(),
                         u"codepage 1252"_qs}));
  auto tasks = OpenDocFileForReading(path)->OpenStorage(u"TaskList"_qs, 0);
  EXPECT_EQ(TaskRecord::fromText(tasks->OpenStream(u"Task2"_qs, 0)->ReadData(vbString).toString()).Name,
            u"Conferi cálculo 2"_qs);
}

TEST(Interop, LibgsfReadsWhatWeWriteAndWeReadWhatItWrites) {
  QTemporaryDir dir;
  const QString ours = dir.filePath(u"ours.qmi"_qs);
  writeSample(ours);
  EXPECT_EQ(test::gsfTree(QFile::encodeName(ours).toStdString()),
            (std::vector<std::string>{"\x05"
                                      "DocumentSummaryInformation 116",
                                      "\x05SummaryInformation 72", "LastTaskId 4", "TaskList/",
                                      "TaskList/Task1 134", "TaskList/Task2 136"}));
  const QString theirs = dir.filePath(u"theirs.qmi"_qs);
  ASSERT_TRUE(test::gsfWriteTasks(QFile::encodeName(theirs).toStdString(), 300));
  auto tasks = OpenDocFileForReading(theirs)->OpenStorage(u"TaskList"_qs, 0);
  EXPECT_EQ(tasks->Elements().Count(), 300);
  EXPECT_EQ(tasks->OpenStream(u"Task299"_qs, 0)->ReadData(vbString), QVariant(u"[Name](Tarefa 299)"_qs));
  EXPECT_EQ(tasks->OpenStream(u"Task7"_qs, 0)->Stat().size(), 5000) << "a stream of its own sectors";
}

TEST(Commits, AWriterKilledAtAnyMomentLeavesTheOldOrTheNewFile) {
  QTemporaryDir dir;
  const QString path = dir.filePath(u"qm000001.qmi"_qs);
  for (int round = 0; round < 6; ++round) {
    QProcess worker;
    worker.start(QStringLiteral(QUIMBEL_PROJINFO_WORKER), {path, u"100000"_qs});
    ASSERT_TRUE(worker.waitForReadyRead(20000)) << worker.readAllStandardError().toStdString();
    QThread::msleep(QRandomGenerator::global()->bounded(5, 60));
    ::kill(static_cast<pid_t>(worker.processId()), SIGKILL);
    worker.waitForFinished();
    // Every task the counter promises is there and readable; nothing else is.
    auto root = OpenDocFileForReading(path);
    const qint32 last = root->OpenStream(u"LastTaskId"_qs, 0)->ReadData(vbLong).toInt();
    auto tasks = root->OpenStorage(u"TaskList"_qs, 0);
    ASSERT_EQ(tasks->Elements().Count(), last) << "round " << round;
    EXPECT_EQ(
        TaskRecord::fromText(tasks->OpenStream(u"Task%1"_qs.arg(last), 0)->ReadData(vbString).toString())
            .ItemId,
        last);
  }
}

}  // namespace
}  // namespace projinfo
