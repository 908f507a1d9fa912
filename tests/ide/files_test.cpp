// SPDX-License-Identifier: MIT
// File and project commands: new, add, remove, save, save as, close with the questions about unsaved
// changes; broken or unreadable input opens nothing and names what failed; a failed save keeps what is on
// disk and says what failed; the Add-In Manager loads and unloads add-ins.
#include "addinmanager.h"
#include "codebinding.h"
#include "codeeditor.h"
#include "codewindow.h"
#include "fileio/fileio.h"
#include "host/model/addins.h"
#include "host/model/events.h"
#include "idecommands.h"
#include "idefixture.h"
#include "projectexplorer.h"
#include "windowmanager.h"

#include <gtest/gtest.h>

#include <QCheckBox>
#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QMdiArea>
#include <QProcess>
#include <QTemporaryDir>
#include <QTextCursor>

namespace desktop {
namespace {

using host::test::readBytes;
using host::test::writeBytes;
using test::settle;
using test::waitFor;

class FilesTest : public test::IdeTest {
 protected:
  IdeCommands& commands() { return m_window->commands(); }
  void selectLoja() { m_window->explorer().selectComponent(component(u"Loja"_qs, u"modPrincipal"_qs)); }
};

TEST_F(FilesTest, AddModuleAddsToTheCurrentProjectAndOpensItsCode) {
  selectLoja();
  QStringList added;
  auto sink = m_ide.vbe->events().components->ItemAdded.connect(
      [&](const ide::Ref<ide::VBComponent>& c) { added << c->Name(); });
  commands().run(host::BuiltinCommand::AddModule);
  settle();
  EXPECT_EQ(added, QStringList{u"Module1"_qs});
  auto module = component(u"Loja"_qs, u"Module1"_qs);
  ASSERT_TRUE(module);
  EXPECT_EQ(m_ide.vbe->ActiveCodePane(), module->codeModule()->pane());
  commands().run(host::BuiltinCommand::AddForm);
  settle();
  auto form = component(u"Loja"_qs, u"Form1"_qs);
  ASSERT_TRUE(form);
  EXPECT_EQ(m_ide.vbe->ActiveWindow(), form->designerWindow());
}

TEST_F(FilesTest, SaveWritesWhatWasTyped) {
  auto principal = component(u"Loja"_qs, u"modPrincipal"_qs);
  openCode(u"Loja"_qs, u"modPrincipal"_qs);
  principal->codeModule()->pane()->SetSelection(1, 1, 1, 1);
  auto* code = m_window->windows().activeCodeWindow();
  ASSERT_NE(code, nullptr);
  QTextCursor cursor = code->editor()->textCursor();
  cursor.insertText(u"' gravado pela IDE\n"_qs);
  ASSERT_TRUE(commands().saveAll());
  EXPECT_TRUE(
      readBytes(m_copy.path(u"Loja/modPrincipal.bas"_qs))
          .contains("Attribute VB_Name = \"modPrincipal\"\r\n' gravado pela IDE\r\nOption Explicit\r\n"));
  EXPECT_FALSE(principal->IsDirty());
}

TEST_F(FilesTest, SaveAsMovesTheProjectFile) {
  auto project = m_ide.vbe->project(u"Loja"_qs);
  const QString target = m_copy.path(u"Loja/LojaNova.vbp"_qs);
  ASSERT_TRUE(commands().saveProjectAs(project, target));
  EXPECT_TRUE(QFileInfo::exists(target));
  EXPECT_EQ(project->FileName(), target);
}

TEST_F(FilesTest, RemovingAChangedComponentAsksFirst) {
  auto clientes = component(u"Loja"_qs, u"clsClientes"_qs);
  clientes->codeModule()->InsertLines(1, u"' mudado"_qs);
  m_window->explorer().selectComponent(clientes);
  m_ide.ui->queueAnswer(ide::mb::Cancel);
  commands().run(host::BuiltinCommand::RemoveComponent);
  EXPECT_TRUE(component(u"Loja"_qs, u"clsClientes"_qs));
  ASSERT_EQ(m_messages.size(), 1);
  EXPECT_TRUE(m_messages.front().contains(u"clsClientes"_qs));
  m_ide.ui->queueAnswer(ide::mb::No);
  commands().run(host::BuiltinCommand::RemoveComponent);
  EXPECT_FALSE(component(u"Loja"_qs, u"clsClientes"_qs));
}

TEST_F(FilesTest, ClosingAProjectWithChangesAsksAndCancelKeepsItNoDiscardsAndYesSaves) {
  auto project = m_ide.vbe->project(u"Utilitarios"_qs);
  project->component(u"modApi"_qs)->codeModule()->InsertLines(1, u"' mudado"_qs);
  m_ide.ui->queueAnswer(ide::mb::Cancel);
  EXPECT_FALSE(commands().closeProject(project));
  EXPECT_EQ(m_ide.vbe->projects().size(), 2u);
  ASSERT_EQ(m_messages.size(), 1);
  EXPECT_TRUE(m_messages.front().contains(u"modApi.bas"_qs)) << m_messages.front().toStdString();
  const QString file = m_copy.path(u"Utilitarios/modApi.bas"_qs);
  const QByteArray onDisk = readBytes(file);
  m_ide.ui->queueAnswer(ide::mb::No);
  EXPECT_TRUE(commands().closeProject(project));
  EXPECT_EQ(m_ide.vbe->projects().size(), 1u);
  EXPECT_EQ(readBytes(file), onDisk) << "No discards the change";

  ASSERT_TRUE(commands().open(m_copy.path(u"Utilitarios/Utilitarios.vbp"_qs), false));
  project = m_ide.vbe->project(u"Utilitarios"_qs);
  project->component(u"modApi"_qs)->codeModule()->InsertLines(1, u"' mudado"_qs);
  m_ide.ui->queueAnswer(ide::mb::Yes);
  EXPECT_TRUE(commands().closeProject(project));
  EXPECT_TRUE(readBytes(file).contains("' mudado\r\n"));
}

TEST_F(FilesTest, NewProjectReplacesTheProjectsWithAFreshOneAndItsForm) {
  m_ide.ui->queueAnswer(ide::mb::No);
  commands().run(host::BuiltinCommand::NewProject);
  settle();
  ASSERT_EQ(m_ide.vbe->projects().size(), 1u);
  auto project = m_ide.vbe->projects().front();
  EXPECT_EQ(project->Name(), u"Project1"_qs);
  ASSERT_EQ(project->components().size(), 1u);
  EXPECT_EQ(project->components().front()->Name(), u"Form1"_qs);
  EXPECT_EQ(m_ide.vbe->ActiveWindow(), project->components().front()->designerWindow());
}

TEST_F(FilesTest, ClosingTheWindowAsksAboutChanges) {
  m_window->show();
  component(u"Loja"_qs, u"modPrincipal"_qs)->codeModule()->InsertLines(1, u"' x"_qs);
  m_ide.ui->queueAnswer(ide::mb::Cancel);
  EXPECT_FALSE(m_window->close());
  EXPECT_TRUE(m_window->isVisible());
  ASSERT_EQ(m_messages.size(), 1);
  EXPECT_TRUE(m_messages.front().contains(u"modPrincipal.bas"_qs));
  m_ide.ui->queueAnswer(ide::mb::No);
  EXPECT_TRUE(m_window->close());
}

// ---------------------------------------------------------------------------------------------------
// Bad input

TEST_F(FilesTest, ABrokenOrUnreadableProjectIsNamedWithWhatFailedAndNothingOpens) {
  QTemporaryDir dir;
  writeBytes(dir.filePath(u"Broken.vbp"_qs),
             "Type=Exe\r\nModule=modA; modA.bas\r\nForm=Pasta.frm\r\nName=\"Broken\"\r\n");
  writeBytes(dir.filePath(u"modA.bas"_qs), "Attribute VB_Name = \"modA\"\r\nOption Explicit\r\n");
  QDir(dir.path()).mkdir(u"Pasta.frm"_qs);
  QDir(dir.path()).mkdir(u"Pasta.vbp"_qs);
  const std::pair<QString, QStringList> cases[] = {
      {u"Broken.vbp"_qs, {u"Broken.vbp"_qs, u"line 3"_qs, u"Pasta.frm"_qs}},
      {u"Pasta.vbp"_qs, {u"Pasta.vbp"_qs, u"directory"_qs}},
  };
  for (const auto& [file, named] : cases) {
    m_messages.clear();
    m_ide.ui->queueAnswer(ide::mb::OK);
    EXPECT_FALSE(commands().open(dir.filePath(file), false));
    EXPECT_EQ(m_ide.vbe->projects().size(), 2u);
    ASSERT_EQ(m_messages.size(), 1);
    for (const QString& text : named)
      EXPECT_TRUE(m_messages.front().contains(text)) << m_messages.front().toStdString();
  }
}

TEST_F(FilesTest, AFailedSaveKeepsTheFilesOnDiskAndSaysWhatFailed) {
  auto api = component(u"Utilitarios"_qs, u"modApi"_qs);
  api->codeModule()->InsertLines(1, u"' mudado"_qs);
  // The file's folder is a plain file: nobody, not even root, can write there.
  writeBytes(m_copy.path(u"bloqueio"_qs), "x");
  api->setFilePath(m_copy.path(u"bloqueio/modApi.bas"_qs));
  const auto before = m_copy.snapshot();
  m_ide.ui->queueAnswer(ide::mb::OK);
  EXPECT_FALSE(commands().saveAll());
  ASSERT_FALSE(m_messages.isEmpty());
  EXPECT_TRUE(m_messages.last().contains(u"bloqueio/modApi.bas"_qs)) << m_messages.last().toStdString();
  EXPECT_EQ(m_copy.snapshot(), before);
  EXPECT_TRUE(api->IsDirty());
}

TEST_F(FilesTest, AFileAnotherProgramChangedIsOverwrittenOnlyWhenTheUserSaysSo) {
  auto api = component(u"Utilitarios"_qs, u"modApi"_qs);
  api->codeModule()->InsertLines(1, u"' mudado"_qs);
  const QByteArray theirs = "Attribute VB_Name = \"modApi\"\r\n' de outro programa\r\n";
  writeBytes(api->filePath(), theirs);
  m_ide.ui->queueAnswer(ide::mb::No);
  EXPECT_FALSE(commands().saveAll());
  ASSERT_FALSE(m_messages.isEmpty());
  EXPECT_TRUE(m_messages.last().contains(QDir::toNativeSeparators(api->filePath())));
  EXPECT_EQ(readBytes(api->filePath()), theirs);
  EXPECT_TRUE(api->IsDirty());
  m_ide.ui->queueAnswer(ide::mb::Yes);
  EXPECT_TRUE(commands().saveAll());
  EXPECT_TRUE(readBytes(api->filePath()).contains("' mudado\r\n"));
  EXPECT_FALSE(api->IsDirty());
}

TEST_F(FilesTest, ASaveThatCannotBeUndoneSaysWhichFileHoldsTheNewText) {
  auto principal = component(u"Loja"_qs, u"modPrincipal"_qs);
  auto api = component(u"Utilitarios"_qs, u"modApi"_qs);
  principal->codeModule()->InsertLines(1, u"' mudado"_qs);
  api->codeModule()->InsertLines(1, u"' mudado"_qs);
  fileio::setFileFaultHook([&](fileio::FileStep step, const QString& path) {
    const bool replace = step == fileio::FileStep::Replace && path == api->filePath();
    return replace || (step == fileio::FileStep::Restore && path == principal->filePath()) ? EIO : 0;
  });
  m_ide.ui->queueAnswer(ide::mb::OK);
  EXPECT_FALSE(commands().saveAll());
  fileio::setFileFaultHook({});
  ASSERT_FALSE(m_messages.isEmpty());
  EXPECT_FALSE(m_messages.last().contains(u"unchanged"_qs)) << m_messages.last().toStdString();
  EXPECT_TRUE(m_messages.last().contains(principal->filePath() + u" holds the new text"_qs));
  EXPECT_FALSE(principal->IsDirty());
  EXPECT_TRUE(api->IsDirty());
}

/// A small file system of its own, for a disk that is full; needs the right to mount (root in CI).
class SmallDisk {
 public:
  SmallDisk() {
    m_mounted = QProcess::execute(u"mount"_qs, {u"-t"_qs, u"tmpfs"_qs, u"-o"_qs, u"size=64k"_qs, u"tmpfs"_qs,
                                                m_dir.path()}) == 0;
  }
  ~SmallDisk() {
    if (m_mounted) QProcess::execute(u"umount"_qs, {m_dir.path()});
  }
  bool mounted() const { return m_mounted; }
  bool makeReadOnly() {
    return QProcess::execute(u"mount"_qs, {u"-o"_qs, u"remount,ro"_qs, m_dir.path()}) == 0;
  }
  QString path(const QString& name) const { return m_dir.filePath(name); }

 private:
  QTemporaryDir m_dir;
  bool m_mounted = false;
};

TEST_F(FilesTest, AWriteToAFullDiskOrAReadOnlyFolderKeepsTheOldFile) {
  // Root may write into any folder whose mode forbids it; a file system mounted read-only stops everyone.
  for (const bool readOnly : {false, true}) {
    SmallDisk disk;
    if (!disk.mounted()) GTEST_SKIP() << "cannot mount a small file system here";
    const QByteArray original = readBytes(m_copy.path(u"Utilitarios/modApi.bas"_qs));
    const QString file = disk.path(u"modApi.bas"_qs);
    writeBytes(file, original);
    if (readOnly) {
      ASSERT_TRUE(disk.makeReadOnly());
    }
    auto api = component(u"Utilitarios"_qs, u"modApi"_qs);
    api->setFilePath(file);
    QStringList lines{u"' mudado"_qs};
    for (int i = 0; !readOnly && i < 2000; ++i)
      lines << u"' linha de enchimento número %1 para encher o disco"_qs.arg(i);
    api->codeModule()->InsertLines(1, lines.join(u"\r\n"_qs));
    m_ide.ui->queueAnswer(ide::mb::OK);
    EXPECT_FALSE(commands().saveComponent(api, false));
    ASSERT_FALSE(m_messages.isEmpty());
    EXPECT_TRUE(m_messages.last().contains(readOnly ? file : u"modApi"_qs))
        << m_messages.last().toStdString();
    EXPECT_EQ(readBytes(file), original);
    EXPECT_TRUE(api->IsDirty());
  }
}

// ---------------------------------------------------------------------------------------------------
// Add-In Manager

TEST_F(FilesTest, TheAddInManagerLoadsAndUnloadsAnAddIn) {
  auto addIn = m_ide.vbe->addIns().registerLibrary(QStringLiteral(QUIMBEL_TEST_ADDIN), false);
  {
    AddInManagerDialog dialog(m_ide.vbe->addIns(), m_window.get());
    dialog.findChild<QCheckBox*>(u"loadedCheck"_qs)->setChecked(true);
    dialog.findChild<QCheckBox*>(u"startupCheck"_qs)->setChecked(true);
    dialog.apply({});
  }
  EXPECT_TRUE(addIn->Connect());
  EXPECT_TRUE(addIn->loadOnStartup());
  {
    AddInManagerDialog dialog(m_ide.vbe->addIns(), m_window.get());
    EXPECT_TRUE(dialog.findChild<QCheckBox*>(u"loadedCheck"_qs)->isChecked());
    dialog.findChild<QCheckBox*>(u"loadedCheck"_qs)->setChecked(false);
    dialog.apply({});
  }
  EXPECT_TRUE(waitFor([&] { return !addIn->Connect(); }));
}

}  // namespace
}  // namespace desktop
