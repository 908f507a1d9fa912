// SPDX-License-Identifier: MIT
// The task and favourites windows offscreen, and the add-in's project events over the headless IDE: a
// closed project keeps its favourites, a saved one carries its file along.
#include "addinfixture.h"
#include "common/strings.h"
#include "host/model/events.h"
#include "navigation/frmorgfav.h"
#include "projinfo/frmnewtask.h"
#include "projinfo/frmtasks.h"
#include "projinfo/records.h"
#include "projinfo/storage/mdlstorage.h"
#include "projinfofixture.h"
#include "testproject.h"

#include <gtest/gtest.h>

#include <QDir>
#include <QFileInfo>
#include <QHeaderView>
#include <QLineEdit>
#include <QPlainTextEdit>
#include <QPushButton>
#include <QTest>
#include <QTreeWidget>

namespace projinfo::test {
namespace {

/// The tasks of a project's info file on disk, as "name:done".
QStringList tasksOnDisk(const QString& file) {
  QStringList tasks;
  auto list = OpenDocFileForReading(file)->OpenStorage(u"TaskList"_qs, STGM_READ);
  for (const VBSTATSTG& element : list->Elements()) {
    const auto task =
        TaskRecord::fromText(list->OpenStream(element.Name(), STGM_READ)->ReadData(vbString).toString());
    tasks << task.Name + (task.Done ? u":done"_qs : u":"_qs);
  }
  return tasks;
}

QStringList rows(QTreeWidget* list, int column = 0) {
  QStringList texts;
  for (int i = 0; i < list->topLevelItemCount(); ++i)
    texts << list->topLevelItem(i)->text(column);
  return texts;
}

struct TaskScene {
  Scene scene;
  std::shared_ptr<host::ProjectImpl> project =
      scene.open(scene.writeProject(u"Loja"_qs, {{u"basQMInf000400"_qs, u"'PROJID=000400\r\n"_qs}}));
  QString file = scene.path(u"Loja/qm000400.qmi"_qs);
  CTaskList& list = scene.tasks(project);
};

TEST(TaskWindow, RowsFollowTheTasksAndEveryChangeIsWrittenAtOnce) {
  TaskScene s;
  frmTasks window(s.list);
  window.show();
  EXPECT_EQ(window.windowTitle(), u"Quimbel: Loja - Tarefas"_qs);
  EXPECT_EQ(window.lvTasks()->headerItem()->text(0), u"Tarefas a realizar (tique as já realizadas)"_qs);
  EXPECT_FALSE(window.cmdEdit()->isEnabled());
  EXPECT_FALSE(window.cmdRemove()->isEnabled());
  for (const char* name : {"Um", "Dois", "Três"})
    s.scene.addTask(s.project, QString::fromUtf8(name));
  window.Initialize();
  EXPECT_EQ(rows(window.lvTasks()), (QStringList{u"Três"_qs, u"Dois"_qs, u"Um"_qs})) << "newest first";

  window.lvTasks()->topLevelItem(0)->setSelected(true);
  window.lvTasks()->topLevelItem(2)->setSelected(true);
  EXPECT_FALSE(window.cmdEdit()->isEnabled());
  EXPECT_TRUE(window.cmdRemove()->isEnabled());
  window.cmdRemove()->click();
  EXPECT_EQ(rows(window.lvTasks()), QStringList{u"Dois"_qs});
  EXPECT_EQ(tasksOnDisk(s.file), QStringList{u"Dois:"_qs});

  window.lvTasks()->topLevelItem(0)->setCheckState(0, Qt::Checked);
  EXPECT_EQ(tasksOnDisk(s.file), QStringList{u"Dois:done"_qs});
  window.lvTasks()->setCurrentItem(window.lvTasks()->topLevelItem(0));
  QTest::keyClick(window.lvTasks(), Qt::Key_Space);
  EXPECT_EQ(tasksOnDisk(s.file), QStringList{u"Dois:"_qs});
  QTest::keyClick(window.lvTasks(), Qt::Key_Delete);
  EXPECT_TRUE(tasksOnDisk(s.file).isEmpty());
}

TEST(TaskWindow, TheTaskDialogRefusesABlankNameAsksOnItsCloseBoxAndWritesOnlyChanges) {
  TaskScene s;
  auto& ui = *s.scene.vbe->headlessUi();
  frmTasks window(s.list);
  auto dialogFor = [&](frmNewTask::Mode mode, std::shared_ptr<CTaskItem> task) {
    auto dialog = std::make_unique<frmNewTask>(s.list, &window, mode, task);
    dialog->Initialize();
    dialog->show();
    return dialog;
  };
  auto dialog = dialogFor(frmNewTask::NewTask, nullptr);
  EXPECT_EQ(dialog->windowTitle(), u"Quimbel: Loja - Nova Tarefa"_qs);
  QTest::keyClicks(dialog->txtName(), u"   "_qs);
  dialog->cmdOK()->click();
  EXPECT_EQ(s.scene.takeMessages(), QStringList{common::LoadResString(5088)});
  EXPECT_TRUE(dialog->isVisible());
  dialog->txtName()->setText(u"  Revisar (frete)"_qs);
  QTest::keyClicks(dialog->txtDescription(), u"a\tb"_qs);
  dialog->cmdOK()->click();
  EXPECT_FALSE(dialog->isVisible());
  EXPECT_EQ(s.list.Tasks.Item(1)->Name, u"  Revisar (frete)"_qs) << "stored as typed";
  EXPECT_EQ(s.list.Tasks.Item(1)->Text, u"a\tb"_qs);
  EXPECT_EQ(rows(window.lvTasks()), QStringList{u"  Revisar (frete)"_qs});

  // Unchanged: nothing is written. Cancelled: no question. The close box asks; No keeps nothing.
  const QByteArray before = host::test::readBytes(s.file);
  dialogFor(frmNewTask::EditTask, s.list.Tasks.Item(1))->cmdOK()->click();
  auto cancelled = dialogFor(frmNewTask::EditTask, s.list.Tasks.Item(1));
  EXPECT_EQ(cancelled->windowTitle(), u"Quimbel: Loja - Editar Tarefa"_qs);
  cancelled->txtName()->setText(u"Outro"_qs);
  cancelled->cmdCancel()->click();
  auto closed = dialogFor(frmNewTask::EditTask, s.list.Tasks.Item(1));
  closed->txtName()->setText(u"Outro"_qs);
  ui.queueAnswer(ide::mb::No);
  closed->close();
  EXPECT_EQ(host::test::readBytes(s.file), before);
  EXPECT_EQ(s.scene.takeMessages(), QStringList{common::LoadResString(5087)});
  auto saved = dialogFor(frmNewTask::EditTask, s.list.Tasks.Item(1));
  saved->txtName()->setText(u"Revisado"_qs);
  ui.queueAnswer(ide::mb::Yes);
  saved->close();
  EXPECT_EQ(tasksOnDisk(s.file), QStringList{u"Revisado:"_qs});
}

TEST(FavoritesWindow, RowsOpenTheirPlaceAndDeleteTheirRecords) {
  Scene scene;
  auto project = scene.open(scene.writeProject(
      u"Loja"_qs, {{u"basQMInf000401"_qs, u"'PROJID=000401\r\n"_qs},
                   {u"modA"_qs, u"Option Explicit\r\nSub Um()\r\n  x = 1\r\n  x = 2\r\nEnd Sub\r\n"_qs}}));
  scene.vbe->setActiveVBProject(project);
  auto& favorites = *dynamic_cast<navigation::CFavorites*>(scene.info(project).Favorites());
  auto modA = project->component(u"modA"_qs);
  {
    navigation::frmOrgFav empty(favorites);
    EXPECT_EQ(empty.lvFavorites()->topLevelItemCount(), 0);
    EXPECT_EQ(empty.lvFavorites()->headerItem()->text(2), u"Módulo"_qs);
  }
  for (int line : {1, 3, 4, 5})
    favorites.AddPlace(modA, line == 1 ? QString() : u"Um"_qs, ide::ProcKind::Proc, line);
  navigation::frmOrgFav window(favorites);
  window.show();
  EXPECT_EQ(window.windowTitle(), u"Quimbel: Loja - Favoritos"_qs);
  EXPECT_EQ(rows(window.lvFavorites()),
            (QStringList{u"Um"_qs, u"Um"_qs, u"Um"_qs, u"General Declarations"_qs}));
  EXPECT_EQ(rows(window.lvFavorites(), 1), (QStringList{u"3"_qs, u"2"_qs, u"1"_qs, u"1"_qs}));
  EXPECT_EQ(rows(window.lvFavorites(), 2), QStringList(4, u"modA"_qs));

  for (int i = 0; i < 3; ++i)
    window.lvFavorites()->topLevelItem(i)->setSelected(true);
  QTest::keyClick(window.lvFavorites(), Qt::Key_Delete);
  EXPECT_EQ(rows(window.lvFavorites()), QStringList{u"General Declarations"_qs});
  EXPECT_EQ(streamsOf(scene.path(u"Loja/qm000401.qmi"_qs), u"Favorites"_qs), QStringList{u"Favorite1"_qs});

  // Below the last row: the window closes and the caret stays.
  auto pane = modA->CodeModule()->CodePane();
  pane->SetSelection(4, 3, 4, 3);
  QTest::mouseDClick(window.lvFavorites()->viewport(), Qt::LeftButton, {}, QPoint(20, 150));
  EXPECT_FALSE(window.isVisible());
  int line = 0, column = 0, endLine = 0, endColumn = 0;
  pane->GetSelection(line, column, endLine, endColumn);
  EXPECT_EQ(line, 4);
  window.show();
  window.openRow(window.lvFavorites()->topLevelItem(0));
  EXPECT_FALSE(window.isVisible());
  pane->GetSelection(line, column, endLine, endColumn);
  EXPECT_EQ(line, 1);
}

// ---------------------------------------------------------------------------------------------------
// Through the add-in

TEST(AddInEvents, AClosedProjectKeepsItsFavouritesAndASavedOneCarriesItsFileAlong) {
  addin::test::AddInEnvironment environment;
  host::test::ExampleCopy copy;
  auto vbe = host::VbeImpl::create();
  auto addIn = std::make_shared<addin::test::FakeAddIn>(vbe);
  // A project open when the add-in starts gets its module and file then.
  const QString vbp = copy.path(u"Loja/Loja.vbp"_qs);
  auto project = vbe->openProject(vbp);
  addin::Connect connection{addin::Environment{}};
  QVariantList custom;
  connection.OnConnection(vbe, ide::ConnectMode::AfterStartup, addIn, custom);
  int componentsRemoved = 0;
  auto removed = vbe->events().components->ItemRemoved.connect([&](auto&) { ++componentsRemoved; });
  auto identity = FindProjectId(project);
  ASSERT_TRUE(identity) << "the add-in gave the project its module";
  const QString file = copy.path(u"Loja/"_qs) + infoFileTitle(identity->id);
  project->save();
  auto module = project->component(u"modPrincipal"_qs);
  module->CodeModule()->CodePane()->Show();
  module->CodeModule()->CodePane()->SetSelection(31, 1, 31, 1);
  connection.globals()->VBEvents().EvMnuAddToFavoritesDsg_Click();
  EXPECT_EQ(streamsOf(file, u"Favorites"_qs), QStringList{u"Favorite1"_qs});

  vbe->selectComponent(module);
  vbe->removeProject(project);
  EXPECT_EQ(componentsRemoved, 0);
  EXPECT_EQ(streamsOf(file, u"Favorites"_qs), QStringList{u"Favorite1"_qs}) << "closing deletes no favourite";

  project = vbe->openProject(vbp);
  const QString elsewhere = copy.path(u"Copia/Loja.vbp"_qs);
  QDir().mkpath(QFileInfo(elsewhere).path());
  project->SaveAs(elsewhere);
  EXPECT_FALSE(QFileInfo::exists(file));
  EXPECT_EQ(streamsOf(copy.path(u"Copia/"_qs) + infoFileTitle(identity->id), u"Favorites"_qs),
            QStringList{u"Favorite1"_qs});
  EXPECT_TRUE(vbe->headlessUi()->messageBoxes().empty());
  connection.OnDisconnection(ide::DisconnectMode::HostShutdown, custom);
}

TEST(AddInEvents, AnAddInUnloadedWhileTheIdeRunsOnLeavesTheFilesOfProjectsThatMayStillBeSaved) {
  addin::test::AddInEnvironment environment;
  host::test::ExampleCopy copy;
  const QByteArray oldTemp = qgetenv("TMPDIR");
  QDir().mkpath(environment.path(u"tmp"_qs));
  qputenv("TMPDIR", environment.path(u"tmp"_qs).toLocal8Bit());
  auto vbe = host::VbeImpl::create();
  auto addIn = std::make_shared<addin::test::FakeAddIn>(vbe);
  auto saved = vbe->openProject(copy.path(u"Loja/Loja.vbp"_qs));
  auto fresh = vbe->newProject();
  QVariantList custom;
  {
    addin::Connect connection{addin::Environment{}};
    connection.OnConnection(vbe, ide::ConnectMode::AfterStartup, addIn, custom);
    connection.OnDisconnection(ide::DisconnectMode::UserClosed, custom);
  }
  // Both modules are new and not saved yet; the files stay, and come along when the add-in is back.
  const QString file = copy.path(u"Loja/"_qs) + infoFileTitle(FindProjectId(saved)->id);
  const QString freshTitle = infoFileTitle(FindProjectId(fresh)->id);
  EXPECT_TRUE(QFileInfo::exists(file));
  EXPECT_TRUE(QFileInfo::exists(environment.path(u"tmp/"_qs) + freshTitle));
  saved->save();
  QDir().mkpath(copy.path(u"Novo"_qs));
  fresh->SaveAs(copy.path(u"Novo/Novo.vbp"_qs));
  addin::Connect again{addin::Environment{}};
  again.OnConnection(vbe, ide::ConnectMode::AfterStartup, addIn, custom);
  EXPECT_TRUE(QFileInfo::exists(file));
  EXPECT_TRUE(QFileInfo::exists(copy.path(u"Novo/"_qs) + freshTitle));
  EXPECT_FALSE(QFileInfo::exists(environment.path(u"tmp/"_qs) + freshTitle));
  EXPECT_TRUE(vbe->headlessUi()->messageBoxes().empty());
  again.OnDisconnection(ide::DisconnectMode::HostShutdown, custom);
  qputenv("TMPDIR", oldTemp);
}

}  // namespace
}  // namespace projinfo::test
