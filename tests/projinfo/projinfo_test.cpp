// SPDX-License-Identifier: MIT
// Project identity and the info file's life cycle in the headless IDE: the identifier module, the file in
// the temporary directory and beside the project, identifiers, records old and new, and files that are
// damaged, held by another IDE or cannot be written.
#include "projinfo/records.h"
#include "projinfo/storage/mdlstorage.h"
#include "projinfofixture.h"
#include "testproject.h"

#include <gtest/gtest.h>

#include <QDir>
#include <QFile>
#include <QFileInfo>

#include <csignal>

#include <sys/resource.h>
#include <unistd.h>

namespace projinfo::test {
namespace {

using host::test::readBytes;
using host::test::writeBytes;

TEST(Identity, AModuleIdentifiesItsProjectByNameAndMarkerLine) {
  Scene scene;
  const struct {
    const char* name;
    const char* text;
    const char* id;
  } kCases[] = {
      {"basQMInf000101", "'PROJID=000101\r\n", "000101"},
      {"basqminf7", "Option Explicit\r\n  'projid=000042  \r\n", "000042"},
      {"BASQMINF", "' nada\r\n'PROJID=7\r\n'PROJID=000003 e mais\r\n", "000003"},
      {"basQMInfX", "'PROJID=12ab34\r\n", ""},
      {"basQMInf2", "'PROJID=00042\r\n", ""},
      {"modQMInf", "'PROJID=000007\r\n", ""},
  };
  for (const auto& c : kCases) {
    const QString vbp = scene.writeProject(QString::fromLatin1(c.name),
                                           {{QString::fromLatin1(c.name), QString::fromLatin1(c.text)}});
    auto project = scene.vbe->openProject(vbp);
    const auto found = FindProjectId(project);
    EXPECT_EQ(found ? found->id : QString(), QString::fromLatin1(c.id)) << c.name;
    scene.vbe->removeProject(project);
  }
  // The first of two, in the project's order.
  auto project =
      scene.vbe->openProject(scene.writeProject(u"two"_qs, {{u"modA"_qs, u"'PROJID=000001\r\n"_qs},
                                                            {u"basQMInfB"_qs, u"'PROJID=000002\r\n"_qs},
                                                            {u"basQMInfA"_qs, u"'PROJID=000003\r\n"_qs}}));
  EXPECT_EQ(FindProjectId(project)->module->Name(), u"basQMInfB"_qs);
}

TEST(LifeCycle, ANewProjectGetsAModuleAndAFileThatFollowItsSaves) {
  Scene scene;
  auto project = scene.newProject();
  auto module = project->component(u"basQMInf000001"_qs);
  ASSERT_TRUE(module) << "a fresh database hands out 000001";
  EXPECT_EQ(module->CodeModule()->Lines(1, 1), u"'PROJID=000001"_qs);
  const QString temporary = scene.path(u"tmp/qm000001.qmi"_qs);
  EXPECT_TRUE(QFile::exists(temporary));
  EXPECT_FALSE(scene.info(project).isSaved());
  scene.addTask(project, u"Primeira"_qs);

  // Saved elsewhere: the file goes along, and later sessions find module and file again.
  const QString vbp = scene.path(u"Trabalho/Loja.vbp"_qs);
  QDir().mkpath(scene.path(u"Trabalho"_qs));
  project->SaveAs(vbp);
  scene.infos->projectFileMoved(project, vbp);
  EXPECT_FALSE(QFile::exists(temporary));
  const QString moved = scene.path(u"Trabalho/qm000001.qmi"_qs);
  EXPECT_TRUE(QFile::exists(moved));
  EXPECT_TRUE(scene.info(project).isSaved());
  scene.addTask(project, u"Segunda"_qs);
  scene.close(project);
  EXPECT_EQ(streamsOf(moved, u"TaskList"_qs), (QStringList{u"Task1"_qs, u"Task2"_qs}));

  auto again = scene.open(vbp);
  EXPECT_EQ(scene.info(again).identityModule()->Name(), u"basQMInf000001"_qs);
  EXPECT_EQ(again->components().size(), 1u) << "no second module";
  EXPECT_EQ(scene.tasks(again).Tasks.Count(), 2);

  // A project closed without ever being saved leaves no file; nor does one whose new module was not saved.
  auto unsaved = scene.newProject();
  EXPECT_TRUE(QFile::exists(scene.path(u"tmp/qm000002.qmi"_qs)));
  scene.close(unsaved);
  EXPECT_FALSE(QFile::exists(scene.path(u"tmp/qm000002.qmi"_qs)));
  auto old = scene.open(scene.writeProject(u"Antigo"_qs, {{u"modA"_qs, u"Option Explicit\r\n"_qs}}));
  EXPECT_TRUE(QFile::exists(scene.path(u"Antigo/qm000003.qmi"_qs)));
  scene.close(old);
  EXPECT_FALSE(QFile::exists(scene.path(u"Antigo/qm000003.qmi"_qs)));
  EXPECT_TRUE(scene.takeMessages().isEmpty());

  // The module removed or renamed: the tie is lost (the message names the module it had), the file
  // closed and kept; the module back, added again or renamed back, brings the tasks back.
  CProjInfo& info = scene.info(again);
  auto identity = info.identityModule();
  scene.infos->componentRemoved(identity);
  again->Remove(identity);
  EXPECT_FALSE(info.isOpen());
  identity = again->VBComponents()->AddFile(scene.path(u"Trabalho/basQMInf000001.bas"_qs));
  scene.infos->componentAdded(identity);
  EXPECT_EQ(info.TaskList()->Tasks.Count(), 2);
  identity->setName(u"modOutro"_qs);
  scene.infos->componentRenamed(identity);
  EXPECT_FALSE(info.isOpen());
  identity->setName(u"basQMInf000001"_qs);
  scene.infos->componentRenamed(identity);
  EXPECT_EQ(info.TaskList()->Tasks.Count(), 2);
  const QStringList messages = scene.takeMessages();
  ASSERT_EQ(messages.size(), 2);
  EXPECT_TRUE(messages[1].contains(u"módulo basQMInf000001,"_qs)) << messages[1].toStdString();
  scene.infos->componentRemoved(identity);
  again->Remove(identity);
  scene.close(again);
  EXPECT_TRUE(QFile::exists(moved));
  // Never saved, the project takes its file along even when its module went first.
  auto fresh = scene.newProject();
  scene.infos->componentRemoved(scene.info(fresh).identityModule());
  scene.close(fresh);
  EXPECT_TRUE(QDir(scene.path(u"tmp"_qs)).isEmpty());
}

TEST(LifeCycle, TwoProjectsWithOneIdentifierDoNotShareTheFile) {
  Scene scene;
  const QString vbp = scene.writeProject(u"Loja"_qs, {{u"basQMInf000700"_qs, u"'PROJID=000700\r\n"_qs}});
  auto first = scene.open(vbp);
  scene.addTask(first, u"Da primeira"_qs);
  writeBytes(scene.path(u"Loja/Copia.vbp"_qs), readBytes(vbp).replace("\"Loja\"", "\"Copia\""));
  auto second = scene.open(scene.path(u"Loja/Copia.vbp"_qs));
  const QStringList messages = scene.takeMessages();
  ASSERT_EQ(messages.size(), 1);
  EXPECT_TRUE(messages[0].contains(u"mesmo identificador, 000700"_qs)) << messages[0].toStdString();
  EXPECT_FALSE(scene.info(second).isOpen());
  scene.close(second);
  EXPECT_EQ(scene.tasks(first).Tasks.Count(), 1);
  EXPECT_EQ(streamsOf(scene.path(u"Loja/qm000700.qmi"_qs), u"TaskList"_qs), QStringList{u"Task1"_qs});
}

TEST(Records, ValuesComeBackWhateverTheyHoldAndOldRecordsReadAsBefore) {
  const QString kValues[] = {u"Simples"_qs,
                             u"Com (parênteses) e ) sozinho"_qs,
                             u"[Done](-1)[ItemId](99)"_qs,
                             u"100% %29 %5B"_qs,
                             u"Ação 😀 \t fim"_qs,
                             QString()};
  for (const QString& value : kValues) {
    const TaskRecord task =
        TaskRecord::fromText(TaskRecord{value, value + u"\r\nsegunda"_qs, true, 7}.toText());
    EXPECT_EQ(task.Name, value);
    EXPECT_EQ(task.Text, value + u"\r\nsegunda"_qs);
    EXPECT_TRUE(task.Done);
    EXPECT_EQ(task.ItemId, 7);
  }
  // Records without the marker: each value ends at the first ")" after its key, fields in any order.
  const TaskRecord old = TaskRecord::fromText(u"[ItemId](12)[Done](0)lixo[Text](a (b)[Name](Tarefa)"_qs);
  EXPECT_EQ(old.Name, u"Tarefa"_qs);
  EXPECT_EQ(old.Text, u"a (b"_qs);
  EXPECT_EQ(old.ItemId, 12);
  const FavoriteRecord favorite = FavoriteRecord::fromText(
      u"[ComponentName](modX)[ProcedureName](Main)[ProcKind](3)[ItemId](4)[Line](-2)"_qs);
  EXPECT_EQ(favorite.ProcKind, 3);
  EXPECT_EQ(favorite.Line, -2);
  for (const char* bad : {"[Name](x)[Text]()[ItemId](1)", "[Name](x)[Text]()[Done](0)[ItemId](abc)",
                          "[Name](x)[Text]()[Done](0)[ItemId](2147483648)"})
    EXPECT_NE(host::test::errorNumberOf([&] { TaskRecord::fromText(QString::fromLatin1(bad)); }), 0) << bad;
}

TEST(Identifiers, TasksAreNumberedFromOneAndNoRecordIsEverOverwritten) {
  Scene scene;
  auto project = scene.newProject();
  EXPECT_EQ(scene.addTask(project, u"Um"_qs)->ItemId, 1);
  scene.tasks(project).DeleteTask(1);
  EXPECT_EQ(scene.addTask(project, u"Dois"_qs)->ItemId, 2);
  // A counter behind the records (written by hand, or damaged) does not hand out a used number.
  auto counter = scene.info(project).fileInfo()->CreateStream(u"LastTaskId"_qs, kElementMode);
  counter->WriteData(qint32(0));
  EXPECT_EQ(scene.addTask(project, u"Três"_qs)->ItemId, 3);
  counter->SSeek(0);
  counter->WriteData(std::numeric_limits<qint32>::max());
  EXPECT_EQ(host::test::errorNumberOf([&] { scene.addTask(project, u"Demais"_qs); }), 6);
}

TEST(BadFiles, ADamagedFileIsToldWithItsPathAndLeftAsItIs) {
  Scene scene;
  const QString vbp = scene.writeProject(u"Loja"_qs, {{u"basQMInf000500"_qs, u"'PROJID=000500\r\n"_qs}});
  const QString file = scene.path(u"Loja/qm000500.qmi"_qs);
  const QByteArray kDamaged[] = {QByteArray("texto, não um arquivo composto"), QByteArray(300, '\0')};
  for (QByteArray damaged : kDamaged) {
    if (damaged.startsWith('\0')) damaged.replace(0, 8, "\xD0\xCF\x11\xE0\xA1\xB1\x1A\xE1");
    writeBytes(file, damaged);
    auto project = scene.open(vbp);
    const QStringList messages = scene.takeMessages();
    ASSERT_EQ(messages.size(), 1);
    EXPECT_TRUE(messages[0].contains(QDir::toNativeSeparators(file))) << messages[0].toStdString();
    EXPECT_FALSE(scene.info(project).isOpen());
    EXPECT_FALSE(scene.info(project).unavailable().isEmpty());
    scene.close(project);
    EXPECT_EQ(readBytes(file), damaged);
  }
}

TEST(BadFiles, ASecondIdeIsRefusedTheFileAndChangesNothing) {
  Scene first;
  const QString vbp = first.writeProject(u"Loja"_qs, {{u"basQMInf000500"_qs, u"'PROJID=000500\r\n"_qs}});
  auto project = first.open(vbp);
  first.addTask(project, u"Da primeira"_qs);
  {
    Scene second;
    auto same = second.open(vbp);
    const QStringList messages = second.takeMessages();
    ASSERT_EQ(messages.size(), 1);
    EXPECT_TRUE(messages[0].contains(u"em uso"_qs)) << messages[0].toStdString();
    EXPECT_FALSE(second.info(same).isOpen());
    second.close(same);
  }
  first.addTask(project, u"Ainda da primeira"_qs);
  EXPECT_EQ(streamsOf(first.path(u"Loja/qm000500.qmi"_qs), u"TaskList"_qs),
            (QStringList{u"Task1"_qs, u"Task2"_qs}));
}

/// Makes the folder take no new files: read-only for a user; for root, who writes anywhere, files are
/// limited to a kilobyte instead.
class WriteBlock {
 public:
  explicit WriteBlock(const QString& folder) : m_folder(folder) {
    QFile::setPermissions(folder, QFile::ReadOwner | QFile::ExeOwner);
    if (::geteuid() != 0) return;
    std::signal(SIGXFSZ, SIG_IGN);
    ::getrlimit(RLIMIT_FSIZE, &m_old);
    rlimit small = m_old;
    small.rlim_cur = 1024;
    ::setrlimit(RLIMIT_FSIZE, &small);
  }
  ~WriteBlock() {
    if (::geteuid() == 0) ::setrlimit(RLIMIT_FSIZE, &m_old);
    QFile::setPermissions(m_folder, QFile::ReadOwner | QFile::WriteOwner | QFile::ExeOwner);
  }

 private:
  QString m_folder;
  rlimit m_old{};
};

TEST(BadFiles, AFolderThatTakesNoWritesIsToldOnceAndTheTasksStayForTheSession) {
  Scene scene;
  const QString vbp = scene.writeProject(u"Loja"_qs, {{u"basQMInf000500"_qs, u"'PROJID=000500\r\n"_qs}});
  const QString file = scene.path(u"Loja/qm000500.qmi"_qs);
  std::shared_ptr<host::ProjectImpl> project;
  {
    WriteBlock block(scene.path(u"Loja"_qs));
    project = scene.open(vbp);
    scene.addTask(project, u"Só na memória"_qs, QString(2000, u'x'));
    scene.addTask(project, u"Outra"_qs);
    const QStringList messages = scene.takeMessages();
    ASSERT_EQ(messages.size(), 1) << messages.join(u'|').toStdString();
    EXPECT_TRUE(messages[0].contains(QDir::toNativeSeparators(file))) << messages[0].toStdString();
    EXPECT_EQ(scene.tasks(project).Tasks.Count(), 2);
    EXPECT_EQ(scene.tasks(project).Tasks.Item(1)->Name, u"Só na memória"_qs);
  }
  EXPECT_FALSE(QFile::exists(file)) << "nothing could be written";
}

}  // namespace
}  // namespace projinfo::test
