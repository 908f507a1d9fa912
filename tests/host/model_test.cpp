// SPDX-License-Identifier: MIT
// The IDE model through the object-model interface: opening and saving without damage, projects and
// components, events, windows and panes, form designers, command bars, the IDE mode and add-ins.
#include "generator.h"
#include "host/files/ansi.h"
#include "host/model/addins.h"
#include "host/model/commandbars.h"
#include "host/model/designer.h"
#include "host/model/vbe.h"
#include "host/platform/headlessui.h"
#include "host/platform/manualloop.h"
#include "testproject.h"

#include "printers.h"

#include <gtest/gtest.h>

#include <QDir>
#include <QDirIterator>
#include <QFile>
#include <QFileInfo>
#include <QLibrary>
#include <QTemporaryDir>

namespace host {
namespace {

using test::errorNumberOf;
using test::ExampleCopy;
using test::readBytes;
using test::writeBytes;

QStringList splitCrLf(const QByteArray& bytes) {
  return decodeAnsi(bytes).split(QStringLiteral("\r\n"));
}

std::shared_ptr<ComponentImpl> componentOf(const std::shared_ptr<VbeImpl>& vbe, const QString& project,
                                           const QString& name) {
  auto p = vbe->project(project);
  return p ? p->component(name) : nullptr;
}

// ---------------------------------------------------------------------------------------------------
// Opening and saving

TEST(RoundTrip, TheExampleGroupIsWrittenBackByteForByte) {
  ExampleCopy copy;
  const auto before = copy.snapshot();
  auto vbe = VbeImpl::create();
  const auto projects = vbe->open(copy.groupFile());
  ASSERT_EQ(projects.size(), 2u);
  for (const auto& project : projects) {
    for (const auto& component : project->components()) {
      if (!component->hasCode()) continue;
      EXPECT_FALSE(component->IsDirty()) << component->Name().toStdString();
      component->save(true);  // written even though unchanged
    }
    project->SaveAs(project->FileName());
  }
  EXPECT_EQ(copy.snapshot(), before);
}

TEST(RoundTrip, AnEditChangesOnlyTheEditedLines) {
  ExampleCopy copy;
  const auto before = copy.snapshot();
  auto vbe = VbeImpl::create();
  vbe->open(copy.groupFile());
  auto clientes = componentOf(vbe, QStringLiteral("Loja"), QStringLiteral("clsClientes"));
  ASSERT_TRUE(clientes);
  auto module = clientes->codeModule();
  const int body = module->ProcBodyLine(QStringLiteral("Item"), ide::ProcKind::Get);
  module->ReplaceLine(body + 1, QStringLiteral("    Set Item = mCol(Indice) ' alterado"));
  module->InsertLines(1, QStringLiteral("' cabeçalho novo"));
  EXPECT_TRUE(clientes->IsDirty());
  vbe->saveAll();
  const auto after = copy.snapshot();
  for (auto it = before.cbegin(); it != before.cend(); ++it) {
    if (it.key() == QLatin1StringView("Loja/clsClientes.cls")) continue;
    EXPECT_EQ(after.value(it.key()), it.value()) << it.key().toStdString();
  }
  QStringList expected = splitCrLf(before.value(QStringLiteral("Loja/clsClientes.cls")));
  const int headerLines = expected.indexOf(QStringLiteral("Option Explicit"));
  ASSERT_GT(headerLines, 0);
  // Code line n is file line headerLines + n, plus one for the hidden attribute line below Item's header.
  const int itemLine = expected.indexOf(QStringLiteral("Attribute Item.VB_UserMemId = 0"));
  ASSERT_GT(itemLine, 0);
  expected[itemLine + 1] = QStringLiteral("    Set Item = mCol(Indice) ' alterado");
  expected.insert(headerLines, QStringLiteral("' cabeçalho novo"));
  EXPECT_EQ(splitCrLf(after.value(QStringLiteral("Loja/clsClientes.cls"))), expected);
  EXPECT_FALSE(clientes->IsDirty());
}

TEST(RoundTrip, GeneratedProjectsSurviveLoadAndSave) {
  QTemporaryDir dir;
  gen::GeneratorOptions options;
  options.codeLines = 60'000;
  options.components = 40;
  options.projects = 2;
  options.seed = 7;
  const auto generated = gen::generateProjects(dir.path(), options);
  QMap<QString, QByteArray> before;
  QDirIterator it(dir.path(), QDir::Files, QDirIterator::Subdirectories);
  while (it.hasNext()) {
    const QString file = it.next();
    before.insert(file, readBytes(file));
  }
  auto vbe = VbeImpl::create();
  vbe->open(generated.groupFile);
  qint64 lines = 0;
  for (const auto& project : vbe->projects())
    for (const auto& component : project->components()) {
      if (!component->hasCode()) continue;
      lines += component->codeModule()->CountOfLines();
      component->save(true);
    }
  EXPECT_EQ(lines, generated.codeLines);
  for (auto file = before.cbegin(); file != before.cend(); ++file)
    EXPECT_EQ(readBytes(file.key()), file.value()) << file.key().toStdString();
}

TEST(RoundTrip, AModuleFileOpensAloneAndSavesInPlace) {
  ExampleCopy copy;
  const QString path = copy.path(QStringLiteral("Loja/modPrincipal.bas"));
  const QByteArray original = readBytes(path);
  auto vbe = VbeImpl::create();
  auto project = vbe->openModuleFile(path);
  ASSERT_EQ(project->components().size(), 1u);
  EXPECT_EQ(project->FileName(), QString());
  auto module = project->components().front()->codeModule();
  module->InsertLines(module->CountOfLines() + 1, QStringLiteral("' fim"));
  vbe->saveAll();
  const QByteArray saved = readBytes(path);
  EXPECT_EQ(saved.left(original.size()), original);
  EXPECT_EQ(saved.mid(original.size()), QByteArray("' fim\r\n"));
  EXPECT_FALSE(QFileInfo::exists(copy.path(QStringLiteral("Loja/Project1.vbp"))));
}

TEST(BadInput, FailuresNameTheFileAndLineAndAddNothing) {
  ExampleCopy copy;
  auto vbe = VbeImpl::create();
  QString description;

  EXPECT_EQ(errorNumberOf([&] { vbe->open(copy.path(QStringLiteral("Nada.vbp"))); }, &description),
            ide::err::FileNotFound);
  EXPECT_TRUE(description.contains(QStringLiteral("Nada.vbp")));

  // A form whose description lacks its End.
  const QString form = copy.path(QStringLiteral("Utilitarios/Quebrado.frm"));
  writeBytes(form, "VERSION 5.00\r\nBegin VB.Form Quebrado \r\n   Caption = \"x\"\r\n");
  EXPECT_EQ(errorNumberOf([&] { vbe->open(form); }, &description), 321);
  EXPECT_TRUE(description.contains(QStringLiteral("Quebrado.frm, line"))) << description.toStdString();

  // A line over the IDE's limit, and a file that is not text.
  const QString longLine = copy.path(QStringLiteral("Longa.bas"));
  writeBytes(longLine, "Attribute VB_Name = \"Longa\"\r\n' ok\r\n" + QByteArray(1024, 'x') + "\r\n");
  EXPECT_EQ(errorNumberOf([&] { vbe->open(longLine); }, &description), 321);
  EXPECT_TRUE(description.contains(QStringLiteral("Longa.bas, line 3"))) << description.toStdString();
  const QString binary = copy.path(QStringLiteral("Binario.bas"));
  writeBytes(binary, QByteArray("Attribute VB_Name = \"B\"\r\n\0\1\2", 28));
  EXPECT_EQ(errorNumberOf([&] { vbe->open(binary); }, &description), 321);

  EXPECT_EQ(vbe->VBProjects()->Count(), 0);
}

TEST(MessyProjects, EntriesKeepTheirSpellingAndMissingFilesTheirLines) {
  QTemporaryDir dir;
  const QString file = test::writeMessyProject(dir.path());
  const QByteArray original = readBytes(file);
  writeBytes(dir.filePath(QStringLiteral("Grupo.vbg")),
             "VBGROUP 5.0\r\nStartupProject=entrada.VBP\r\nProject=Outro\\Falta.vbp\r\n");
  auto vbe = VbeImpl::create();
  auto project = vbe->open(dir.filePath(QStringLiteral("Grupo.vbg"))).at(0);
  EXPECT_EQ(project->Count(), 3);
  QStringList missing;
  for (const MissingFile& entry : vbe->missingFiles())
    missing << QStringLiteral("%1: %2").arg(entry.line).arg(entry.entry);
  EXPECT_EQ(missing,
            QStringList({QStringLiteral("3: Outro\\Falta.vbp"), QStringLiteral("4: Classes\\clsFalta.cls")}));
  // A change touches its own entry only (the entries after the missing one still find their lines).
  project->component(QStringLiteral("modMisto"))->setName(QStringLiteral("modAntigo"));
  project->Remove(project->component(QStringLiteral("modEntrada")));
  vbe->saveAll();
  QByteArray expected = original;
  expected.replace("Module=modEntrada; FONTES\\ModEntrada.bas\r\n", "")
      .replace("Module=modMisto;", "Module=modAntigo;");
  EXPECT_EQ(readBytes(file), expected);
}

TEST(Saving, AWriteThatCannotBeDoneSaysWhatFailedAndKeepsTheChanges) {
  ExampleCopy copy;
  auto vbe = VbeImpl::create();
  auto project = vbe->openProject(copy.path(QStringLiteral("Utilitarios/Utilitarios.vbp")));
  auto component = project->component(QStringLiteral("modApi"));
  component->codeModule()->InsertLines(1, QStringLiteral("' x"));
  // A directory where the file should be: no write can replace it, not even root's.
  const QString path = copy.path(QStringLiteral("Utilitarios/modApi.bas"));
  QFile::remove(path);
  ASSERT_TRUE(QDir().mkpath(path + QStringLiteral("/in-the-way")));
  QString description;
  EXPECT_EQ(errorNumberOf([&] { vbe->saveAll(); }, &description), ide::err::PathFileAccessError);
  EXPECT_TRUE(description.contains(QStringLiteral("modApi.bas"))) << description.toStdString();
  EXPECT_TRUE(QFileInfo(path + QStringLiteral("/in-the-way")).isDir());
  EXPECT_TRUE(component->IsDirty());
}

TEST(Saving, AReadOnlyFileIsRefusedAndKeptAsItIs) {
  ExampleCopy copy;
  auto vbe = VbeImpl::create();
  auto project = vbe->openProject(copy.path(QStringLiteral("Utilitarios/Utilitarios.vbp")));
  auto module = project->component(QStringLiteral("modApi"))->codeModule();
  const QString path = copy.path(QStringLiteral("Utilitarios/modApi.bas"));
  const QByteArray original = readBytes(path);
  module->InsertLines(1, QStringLiteral("' x"));
  QFile::setPermissions(path, QFileDevice::ReadOwner | QFileDevice::ReadGroup);
  QString description;
  EXPECT_EQ(errorNumberOf([&] { vbe->saveAll(); }, &description), ide::err::PermissionDenied);
  EXPECT_EQ(description, QStringLiteral("Cannot write %1: the file is read-only").arg(path));
  EXPECT_EQ(readBytes(path), original);
  EXPECT_TRUE(project->component(QStringLiteral("modApi"))->IsDirty());
}

// ---------------------------------------------------------------------------------------------------
// Projects, components and their events

struct EventLog {
  QStringList entries;
  std::vector<ide::Connection> connections;

  void attach(const std::shared_ptr<VbeImpl>& vbe) {
    auto events = vbe->Events();
    auto projects = events->VBProjectsEvents();
    connections.push_back(projects->ItemAdded.connect(
        [this](const ide::Ref<ide::VBProject>& p) { entries << "project added " + p->Name(); }));
    connections.push_back(projects->ItemRemoved.connect([this](const ide::Ref<ide::VBProject>& p) {
      entries << "project removed " + p->Name() + " with " + QString::number(p->VBComponents()->Count());
    }));
    connections.push_back(
        projects->ItemRenamed.connect([this](const ide::Ref<ide::VBProject>& p, const QString& old) {
          entries << "project renamed " + old + " " + p->Name();
        }));
    connections.push_back(projects->ItemActivated.connect(
        [this](const ide::Ref<ide::VBProject>& p) { entries << "project activated " + p->Name(); }));
    auto components = events->VBComponentsEvents(nullptr);
    connections.push_back(components->ItemAdded.connect(
        [this](const ide::Ref<ide::VBComponent>& c) { entries << "added " + c->Name(); }));
    connections.push_back(components->ItemRemoved.connect([this](const ide::Ref<ide::VBComponent>& c) {
      // Still in its project while the event runs.
      entries << "removed " + c->Name() + (c->Collection()->Item(c->Name()) == c ? " (present)" : "");
    }));
    connections.push_back(
        components->ItemRenamed.connect([this](const ide::Ref<ide::VBComponent>& c, const QString& old) {
          entries << "renamed " + old + " " + c->Name();
        }));
    connections.push_back(components->ItemSelected.connect(
        [this](const ide::Ref<ide::VBComponent>& c) { entries << "selected " + c->Name(); }));
    connections.push_back(components->ItemActivated.connect(
        [this](const ide::Ref<ide::VBComponent>& c) { entries << "activated " + c->Name(); }));
    connections.push_back(events->FileControlEvents(nullptr)->AfterChangeFileName.connect(
        [this](const ide::Ref<ide::VBProject>&, ide::FileType type, const QString& newName,
               const QString& oldName) {
          entries << QStringLiteral("file %1 %2 -> %3")
                         .arg(static_cast<int>(type))
                         .arg(QFileInfo(oldName).filePath(), newName);
        }));
  }
};

TEST(Events, OpeningAddingRenamingAndRemovingFireInOrder) {
  ExampleCopy copy;
  auto vbe = VbeImpl::create();
  EventLog log;
  log.attach(vbe);
  auto project = vbe->openProject(copy.path(QStringLiteral("Utilitarios/Utilitarios.vbp")));
  auto added = project->VBComponents()->Add(ide::ComponentType::StdModule);
  EXPECT_EQ(added->Name(), QStringLiteral("Module1"));
  added->setName(QStringLiteral("modNovo"));
  project->VBComponents()->Remove(added);
  const QStringList expected = {QStringLiteral("project added Utilitarios"),
                                QStringLiteral("project activated Utilitarios"),
                                QStringLiteral("added Module1"), QStringLiteral("renamed Module1 modNovo"),
                                QStringLiteral("removed modNovo (present)")};
  EXPECT_EQ(log.entries, expected);
  // Loading components announces none of them: the project's addition covers them.
  EXPECT_EQ(project->components().size(), 3u);
  EXPECT_EQ(errorNumberOf([&] { added->Collection(); }), ide::err::ObjectVariableNotSet);
}

TEST(Events, AHandlerMayCauseFurtherEventsBeforeItReturns) {
  auto vbe = VbeImpl::create();
  QStringList order;
  auto components = vbe->Events()->VBComponentsEvents(nullptr);
  auto onAdded = components->ItemAdded.connect([&](const ide::Ref<ide::VBComponent>& c) {
    order << "added " + c->Name();
    if (c->Name() == QLatin1StringView("Module1")) c->setName(QStringLiteral("Primeiro"));
    order << "added done " + c->Name();
  });
  auto onRenamed =
      components->ItemRenamed.connect([&](const ide::Ref<ide::VBComponent>& c, const QString& old) {
        order << "renamed " + old + " " + c->Name();
      });
  vbe->newProject()->VBComponents()->Add(ide::ComponentType::StdModule);
  const QStringList expected = {QStringLiteral("added Module1"), QStringLiteral("renamed Module1 Primeiro"),
                                QStringLiteral("added done Primeiro")};
  EXPECT_EQ(order, expected);
}

TEST(Components, NamesAreCheckedAndRenamesReachTheFiles) {
  ExampleCopy copy;
  auto vbe = VbeImpl::create();
  auto project = vbe->openProject(copy.path(QStringLiteral("Loja/Loja.vbp")));
  auto module = project->component(QStringLiteral("modConstantes"));
  EXPECT_EQ(errorNumberOf([&] { module->setName(QStringLiteral("modPrincipal")); }), ide::err::NameConflict);
  EXPECT_EQ(errorNumberOf([&] { module->setName(QStringLiteral("2mod")); }), ide::err::InvalidName);
  EXPECT_EQ(errorNumberOf([&] { module->setName(QStringLiteral("Loja")); }), ide::err::NameConflict);
  module->setName(QStringLiteral("modValores"));
  auto form = project->component(QStringLiteral("frmCliente"));
  form->setName(QStringLiteral("frmClienteNovo"));
  vbe->saveAll();
  const QString vbp = decodeAnsi(readBytes(copy.path(QStringLiteral("Loja/Loja.vbp"))));
  EXPECT_TRUE(vbp.contains(QStringLiteral("Module=modValores; modConstantes.bas\r\n")));
  const QString bas = decodeAnsi(readBytes(copy.path(QStringLiteral("Loja/modConstantes.bas"))));
  EXPECT_TRUE(bas.startsWith(QStringLiteral("Attribute VB_Name = \"modValores\"\r\n")));
  const QString frm = decodeAnsi(readBytes(copy.path(QStringLiteral("Loja/frmCliente.frm"))));
  EXPECT_TRUE(frm.contains(QStringLiteral("Begin VB.Form frmClienteNovo ")));
  EXPECT_TRUE(frm.contains(QStringLiteral("Attribute VB_Name = \"frmClienteNovo\"")));
}

TEST(Components, NewComponentsAreSavedBesideTheProject) {
  QTemporaryDir dir;
  auto vbe = VbeImpl::create();
  auto project = vbe->newProject();
  EXPECT_EQ(project->FileName(), QString());
  auto module = project->VBComponents()->Add(ide::ComponentType::StdModule);
  module->CodeModule()->AddFromString(QStringLiteral("Option Explicit\r\nPublic Sub Main()\r\nEnd Sub"));
  auto form = project->VBComponents()->Add(ide::ComponentType::VBForm);
  auto klass = project->VBComponents()->Add(ide::ComponentType::ClassModule);
  EXPECT_EQ(module->FileNames(1), QString());
  const QString path = dir.filePath(QStringLiteral("Novo.vbp"));
  project->SaveAs(path);
  EXPECT_EQ(project->FileName(), path);
  EXPECT_EQ(module->FileNames(1), dir.filePath(QStringLiteral("Module1.bas")));
  EXPECT_EQ(
      readBytes(module->FileNames(1)),
      QByteArray("Attribute VB_Name = \"Module1\"\r\nOption Explicit\r\nPublic Sub Main()\r\nEnd Sub\r\n"));
  EXPECT_TRUE(readBytes(form->FileNames(1)).startsWith("VERSION 5.00\r\nBegin VB.Form Form1 \r\n"));
  EXPECT_TRUE(readBytes(klass->FileNames(1)).startsWith("VERSION 1.0 CLASS\r\n"));
  const QString vbp = decodeAnsi(readBytes(path));
  EXPECT_TRUE(vbp.contains(QStringLiteral("Module=Module1; Module1.bas\r\n")));
  EXPECT_TRUE(vbp.contains(QStringLiteral("Form=Form1.frm\r\n")));
  EXPECT_TRUE(vbp.contains(QStringLiteral("Class=Class1; Class1.cls\r\n")));
  EXPECT_TRUE(project->Saved());

  // The saved project opens again with the same components.
  auto again = VbeImpl::create();
  auto reopened = again->openProject(path);
  EXPECT_EQ(reopened->VBComponents()->Count(), 3);
}

TEST(Projects, SaveAsIntoAnotherDirectoryReportsTheProjectFile) {
  ExampleCopy copy;
  QTemporaryDir elsewhere;
  auto vbe = VbeImpl::create();
  EventLog log;
  log.attach(vbe);
  auto project = vbe->openProject(copy.path(QStringLiteral("Utilitarios/Utilitarios.vbp")));
  const QString oldPath = project->FileName();
  const QString newPath = elsewhere.filePath(QStringLiteral("Util2.vbp"));
  log.entries.clear();
  project->SaveAs(newPath);
  ASSERT_EQ(log.entries.size(), 1);
  EXPECT_EQ(log.entries[0], QStringLiteral("file 3 %1 -> %2").arg(oldPath, newPath));
  // The components stay where they are; the new project file refers to them from its folder.
  const QString vbp = decodeAnsi(readBytes(newPath));
  EXPECT_TRUE(vbp.contains(QStringLiteral("modApi.bas")));
  auto again = VbeImpl::create();
  EXPECT_EQ(again->openProject(newPath)->VBComponents()->Count(), 3);
}

TEST(Projects, RenamingAndRemovingAProject) {
  ExampleCopy copy;
  auto vbe = VbeImpl::create();
  EventLog log;
  log.attach(vbe);
  vbe->open(copy.groupFile());
  log.entries.clear();
  auto util = vbe->project(QStringLiteral("Utilitarios"));
  util->setName(QStringLiteral("Util"));
  EXPECT_EQ(errorNumberOf([&] { util->setName(QStringLiteral("Loja")); }), ide::err::NameConflict);
  vbe->VBProjects()->Remove(util);
  // The project that remains becomes the active one.
  const QStringList expected = {QStringLiteral("project renamed Utilitarios Util"),
                                QStringLiteral("project removed Util with 3"),
                                QStringLiteral("project activated Loja")};
  EXPECT_EQ(log.entries, expected);
  EXPECT_EQ(vbe->VBProjects()->Count(), 1);
  EXPECT_EQ(vbe->ActiveVBProject()->Name(), QStringLiteral("Loja"));
  EXPECT_EQ(errorNumberOf([&] { util->Collection(); }), ide::err::ObjectVariableNotSet);
}

// ---------------------------------------------------------------------------------------------------
// Windows, panes, focus

TEST(Windows, ACodePaneOpensItsWindowAndBecomesActive) {
  ExampleCopy copy;
  auto vbe = VbeImpl::create();
  vbe->open(copy.groupFile());
  EXPECT_FALSE(vbe->ActiveCodePane());
  auto module = componentOf(vbe, QStringLiteral("Loja"), QStringLiteral("modPrincipal"))->CodeModule();
  auto pane = module->CodePane();
  EXPECT_EQ(pane, module->CodePane());
  pane->Show();
  EXPECT_EQ(vbe->ActiveCodePane(), pane);
  EXPECT_EQ(vbe->ActiveWindow(), pane->Window());
  EXPECT_EQ(pane->Window()->Caption(), QStringLiteral("Loja - modPrincipal (Code)"));
  EXPECT_EQ(pane->Window()->Type(), ide::WindowType::CodeWindow);
  EXPECT_EQ(vbe->SelectedVBComponent(), module->Parent());
  auto& windows = vbe->Platform().windows();
  EXPECT_EQ(windows.GetFocus(), pane->Window()->hWnd());
  // In MDI display code windows live in the main window's MDI client.
  const ide::HWnd client =
      windows.FindWindowEx(vbe->MainWindow()->hWnd(), 0, QStringLiteral("MDIClient"), {});
  EXPECT_EQ(windows.FindWindowEx(client, 0, QStringLiteral("VbaWindow"), pane->Window()->Caption()),
            pane->Window()->hWnd());
}

TEST(Windows, ClosingTheActiveCodeWindowActivatesTheNextAndSendsDestroy) {
  ExampleCopy copy;
  auto vbe = VbeImpl::create();
  vbe->open(copy.groupFile());
  const int toolWindows = vbe->Windows()->Count();
  auto first =
      componentOf(vbe, QStringLiteral("Loja"), QStringLiteral("modPrincipal"))->CodeModule()->CodePane();
  auto second =
      componentOf(vbe, QStringLiteral("Loja"), QStringLiteral("clsCliente"))->CodeModule()->CodePane();
  first->Show();
  second->Show();
  auto& windows = vbe->Platform().windows();
  const ide::HWnd hwnd = second->Window()->hWnd();
  bool destroyed = false;
  ide::WndProcRef previous;
  previous =
      windows.SetWindowProc(hwnd, std::make_shared<const ide::WndProc>(
                                      [&](ide::HWnd h, unsigned message, quintptr w, qintptr l) -> qintptr {
                                        if (message == ide::msg::Destroy) destroyed = true;
                                        return windows.CallWindowProc(previous, h, message, w, l);
                                      }));
  const int before = vbe->Windows()->Count();
  second->Window()->Close();
  EXPECT_TRUE(destroyed);
  EXPECT_FALSE(windows.IsWindow(hwnd));
  EXPECT_EQ(vbe->Windows()->Count(), before - 1);
  EXPECT_EQ(vbe->ActiveCodePane(), first);
  EXPECT_EQ(windows.GetFocus(), first->Window()->hWnd());
  first->Window()->Close();
  EXPECT_FALSE(vbe->ActiveCodePane());
  EXPECT_EQ(vbe->ActiveWindow(), vbe->MainWindow());
  // Tool windows stay.
  EXPECT_EQ(vbe->Windows()->Count(), toolWindows);
}

TEST(Windows, SelectionAndTopLineFollowTheIdesConventions) {
  ExampleCopy copy;
  auto vbe = VbeImpl::create();
  vbe->open(copy.groupFile());
  auto module = componentOf(vbe, QStringLiteral("Loja"), QStringLiteral("modPrincipal"))->codeModule();
  auto pane = module->pane();
  pane->setCountOfVisibleLines(10);
  pane->SetSelection(30, 5, 28, 2);  // given backwards
  int sl, sc, el, ec;
  pane->GetSelection(sl, sc, el, ec);
  EXPECT_EQ((std::array{sl, sc, el, ec}), (std::array{28, 2, 30, 5}));
  EXPECT_LE(pane->TopLine(), 28);
  EXPECT_GT(pane->TopLine() + pane->CountOfVisibleLines(), 28);
  pane->setTopLine(100000);
  EXPECT_EQ(pane->TopLine(), module->CountOfLines());
  EXPECT_EQ(errorNumberOf([&] { pane->setTopLine(0); }), ide::err::InvalidProcedureCall);
  // Lines inserted above the selection move it down with its text.
  pane->SetSelection(10, 1, 10, 4);
  module->InsertLines(1, QStringLiteral("' a\r\n' b"));
  pane->GetSelection(sl, sc, el, ec);
  EXPECT_EQ((std::array{sl, sc, el, ec}), (std::array{12, 1, 12, 4}));
}

TEST(Windows, SdiDisplayPutsCodeWindowsAtTheTopLevel) {
  ExampleCopy copy;
  IdeOptions options;
  options.displayModel = ide::DisplayModel::SDI;
  auto vbe = VbeImpl::create(std::move(options));
  vbe->open(copy.groupFile());
  auto pane =
      componentOf(vbe, QStringLiteral("Loja"), QStringLiteral("modPrincipal"))->CodeModule()->CodePane();
  pane->Show();
  EXPECT_EQ(vbe->DisplayModel(), ide::DisplayModel::SDI);
  EXPECT_EQ(
      vbe->Platform().windows().FindWindowEx(0, 0, QStringLiteral("VbaWindow"), pane->Window()->Caption()),
      pane->Window()->hWnd());
}

// ---------------------------------------------------------------------------------------------------
// Members

TEST(Members, TheDefaultMemberIsTheOneWithProcedureIdZero) {
  ExampleCopy copy;
  auto vbe = VbeImpl::create();
  vbe->open(copy.groupFile());
  auto clientes = componentOf(vbe, QStringLiteral("Loja"), QStringLiteral("clsClientes"));
  auto members = clientes->CodeModule()->Members();
  EXPECT_EQ(members->Item(QStringLiteral("Item"))->ProcedureId(), 0);
  EXPECT_EQ(members->Item(QStringLiteral("Item"))->Type(), ide::MemberType::Property);
  EXPECT_FALSE(members->Item(QStringLiteral("Add"))->ProcedureId());
  members->Item(QStringLiteral("Item"))->setProcedureId(1234);
  members->Item(QStringLiteral("Add"))->setProcedureId(0);
  clientes->save();
  const QString cls = decodeAnsi(readBytes(copy.path(QStringLiteral("Loja/clsClientes.cls"))));
  EXPECT_TRUE(
      cls.contains(QStringLiteral("Public Property Get Item(ByVal Indice As Variant) As "
                                  "clsCliente\r\nAttribute Item.VB_UserMemId = 1234\r\n")));
  EXPECT_TRUE(cls.contains(QStringLiteral("As clsCliente\r\nAttribute Add.VB_UserMemId = 0\r\n")));
  EXPECT_EQ(errorNumberOf([&] { members->Item(QStringLiteral("Nenhum")); }), ide::err::SubscriptOutOfRange);
}

// ---------------------------------------------------------------------------------------------------
// Designers

TEST(Designers, ControlsPropertiesAndArraysAsTheFormDescribesThem) {
  ExampleCopy copy;
  auto vbe = VbeImpl::create();
  vbe->open(copy.groupFile());
  auto principal = componentOf(vbe, QStringLiteral("Loja"), QStringLiteral("frmPrincipal"));
  ASSERT_TRUE(principal->Designer());
  EXPECT_EQ(principal->Type(), ide::ComponentType::VBForm);
  EXPECT_EQ(principal->Properties()->Item(QStringLiteral("MDIChild"))->Value(), QVariant(false));
  int menus = 0;
  for (const auto& control : principal->Designer()->VBControls()->items())
    if (control->ClassName() == QLatin1StringView("Menu")) ++menus;
  EXPECT_GE(menus, 3);

  // cmdAcao(0 to 2) and optTipo(0 to 1), the latter inside the frame fraTipo.
  auto cliente = componentOf(vbe, QStringLiteral("Loja"), QStringLiteral("frmCliente"));
  QStringList elements;
  for (const auto& control : cliente->Designer()->VBControls()->items()) {
    const int index = control->Properties()->Item(QStringLiteral("Index"))->Value().toInt();
    if (index >= 0) elements << QStringLiteral("%1(%2)").arg(control->name()).arg(index);
    if (control->name() == QLatin1StringView("optTipo")) {
      EXPECT_EQ(control->Container()->name(), QStringLiteral("fraTipo"));
    }
  }
  EXPECT_EQ(elements, (QStringList{QStringLiteral("cmdAcao(2)"), QStringLiteral("cmdAcao(1)"),
                                   QStringLiteral("cmdAcao(0)"), QStringLiteral("optTipo(1)"),
                                   QStringLiteral("optTipo(0)")}));
  auto txtNome = cliente->Designer()->VBControls()->Item(QStringLiteral("txtNome"));
  EXPECT_EQ(txtNome->Properties()->Item(QStringLiteral("Index"))->Value(), QVariant::fromValue(qint16(-1)));
}

TEST(Designers, AddingRenamingAndRemovingControlsFireEventsAndReachTheFile) {
  ExampleCopy copy;
  auto vbe = VbeImpl::create();
  vbe->open(copy.groupFile());
  auto component = componentOf(vbe, QStringLiteral("Loja"), QStringLiteral("frmCliente"));
  auto designer = component->Designer();
  QStringList events;
  auto source = vbe->Events()->VBControlsEvents(component->project(), designer);
  auto a =
      source->ItemAdded.connect([&](const ide::Ref<ide::VBControl>& c) { events << "added " + c->name(); });
  auto r =
      source->ItemRenamed.connect([&](const ide::Ref<ide::VBControl>& c, const QString& old, int oldIndex) {
        events << QStringLiteral("renamed %1(%2) %3(%4)")
                      .arg(old)
                      .arg(oldIndex)
                      .arg(c->name())
                      .arg(c->Properties()->Item(QStringLiteral("Index"))->Value().toInt());
      });
  auto d = source->ItemRemoved.connect(
      [&](const ide::Ref<ide::VBControl>& c) { events << "removed " + c->name(); });

  auto box = designer->VBControls()->Add(QStringLiteral("VB.TextBox"));
  EXPECT_EQ(box->ClassName(), QStringLiteral("TextBox"));
  EXPECT_EQ(box->Properties()->Item(QStringLiteral("Text"))->Value(), QVariant(QStringLiteral("Text1")));
  EXPECT_EQ(box->Properties()->Item(QStringLiteral("MaxLength"))->Value(), QVariant(qint32(0)));
  box->Properties()->Item(QStringLiteral("Name"))->setValue(QStringLiteral("txtApelido"));
  box->Properties()->Item(QStringLiteral("Index"))->setValue(0);
  box->Properties()->Item(QStringLiteral("MaxLength"))->setValue(QStringLiteral("5"));
  EXPECT_EQ(box->Properties()->Item(QStringLiteral("MaxLength"))->Value(), QVariant(qint32(5)));
  EXPECT_EQ(errorNumberOf([&] {
              box->Properties()->Item(QStringLiteral("MaxLength"))->setValue(QStringLiteral("abc"));
            }),
            380);
  box->Properties()->Item(QStringLiteral("Locked"))->setValue(-1);
  const QStringList expected = {QStringLiteral("added Text1"),
                                QStringLiteral("renamed Text1(-1) txtApelido(-1)"),
                                QStringLiteral("renamed txtApelido(-1) txtApelido(0)")};
  EXPECT_EQ(events, expected);
  component->save();
  const QString frm = decodeAnsi(readBytes(copy.path(QStringLiteral("Loja/frmCliente.frm"))));
  EXPECT_TRUE(frm.contains(QStringLiteral("   Begin VB.TextBox txtApelido \r\n")));
  EXPECT_TRUE(frm.contains(QStringLiteral("      Locked          =   -1  'True\r\n")));
  EXPECT_TRUE(frm.contains(QStringLiteral("      MaxLength       =   5\r\n")));
  events.clear();
  designer->VBControls()->Remove(box);
  EXPECT_EQ(events, QStringList{QStringLiteral("removed txtApelido")});
  EXPECT_EQ(errorNumberOf([&] { box->ClassName(); }), ide::err::ObjectVariableNotSet);
}

TEST(Designers, NewControlsGetOnlyThePropertiesTheirClassHas) {
  auto vbe = VbeImpl::create();
  auto form = vbe->newProject()->VBComponents()->Add(ide::ComponentType::VBForm);
  auto controls = form->Designer()->VBControls();
  auto timer = std::dynamic_pointer_cast<ControlImpl>(controls->Add(QStringLiteral("VB.Timer")));
  auto line = std::dynamic_pointer_cast<ControlImpl>(controls->Add(QStringLiteral("Line")));
  auto label = std::dynamic_pointer_cast<ControlImpl>(controls->Add(QStringLiteral("Label")));
  EXPECT_EQ(timer->node()->propertyNames(), (QStringList{QStringLiteral("Left"), QStringLiteral("Top")}));
  EXPECT_FALSE(line->node()->property(QStringLiteral("Width")));
  EXPECT_FALSE(line->node()->property(QStringLiteral("Caption")));
  EXPECT_EQ(label->node()->property(QStringLiteral("Caption")), QStringLiteral("\"Label1\""));
  EXPECT_TRUE(label->node()->property(QStringLiteral("Height")));
}

TEST(Designers, SelectionChangesAreAnnounced) {
  ExampleCopy copy;
  auto vbe = VbeImpl::create();
  vbe->open(copy.groupFile());
  auto component = componentOf(vbe, QStringLiteral("Loja"), QStringLiteral("frmCliente"));
  auto form = component->form();
  QStringList events;
  auto source = vbe->Events()->SelectedVBControlsEvents(component->project(), form);
  auto a = source->ItemAdded.connect([&](const ide::Ref<ide::VBControl>& c) { events << "+" + c->name(); });
  auto r = source->ItemRemoved.connect([&](const ide::Ref<ide::VBControl>& c) { events << "-" + c->name(); });
  auto nome = form->findControl(QStringLiteral("txtNome"));
  auto email = form->findControl(QStringLiteral("txtEmail"));
  form->setSelection({nome, email});
  form->setSelection({email});
  EXPECT_EQ(events, (QStringList{QStringLiteral("+txtNome"), QStringLiteral("+txtEmail"),
                                 QStringLiteral("-txtNome")}));
  EXPECT_EQ(form->SelectedVBControls()->Count(), 1);
}

TEST(Events, FilesWrittenAddedAndRemovedAreAnnounced) {
  ExampleCopy copy;
  auto vbe = VbeImpl::create();
  auto project = vbe->openProject(copy.path(QStringLiteral("Utilitarios/Utilitarios.vbp")));
  QStringList events;
  auto files = vbe->Events()->FileControlEvents(project);
  auto w = files->AfterWriteFile.connect(
      [&](const ide::Ref<ide::VBProject>&, ide::FileType type, const QString& name, int result) {
        events << QStringLiteral("write %1 %2 %3")
                      .arg(static_cast<int>(type))
                      .arg(QFileInfo(name).fileName())
                      .arg(result);
      });
  auto add = files->AfterAddFile.connect(
      [&](const ide::Ref<ide::VBProject>&, ide::FileType type, const QString& name) {
        events << QStringLiteral("add %1 %2").arg(static_cast<int>(type)).arg(QFileInfo(name).fileName());
      });
  auto rem = files->AfterRemoveFile.connect(
      [&](const ide::Ref<ide::VBProject>&, ide::FileType type, const QString& name) {
        events << QStringLiteral("remove %1 %2").arg(static_cast<int>(type)).arg(QFileInfo(name).fileName());
      });
  project->component(QStringLiteral("modApi"))->codeModule()->InsertLines(1, QStringLiteral("' x"));
  vbe->saveAll();
  auto added = project->VBComponents()->AddFile(copy.path(QStringLiteral("Loja/modConstantes.bas")));
  project->VBComponents()->Remove(added);
  EXPECT_EQ(events,
            (QStringList{QStringLiteral("write 1 modApi.bas 0"), QStringLiteral("add 1 modConstantes.bas"),
                         QStringLiteral("remove 1 modConstantes.bas")}));
  events.clear();
  vbe->saveAll();  // the project file changed (a component came and went)
  EXPECT_EQ(events, QStringList{QStringLiteral("write 3 Utilitarios.vbp 0")});
}

// ---------------------------------------------------------------------------------------------------
// Command bars and the IDE mode

TEST(CommandBars, TheIdesBarsAreThereAndControlsComeAndGo) {
  auto vbe = VbeImpl::create();
  auto bars = vbe->CommandBars();
  auto menuBar = bars->Item(QStringLiteral("Menu Bar"));
  ASSERT_GE(menuBar->Controls()->Count(), 11);
  EXPECT_EQ(menuBar->Controls()->Item(11)->Caption(), QStringLiteral("&Add-Ins"));
  auto addIns = bars->Item(QStringLiteral("Add-Ins"));
  EXPECT_EQ(addIns, menuBar->Controls()->Item(11)->CommandBar());
  for (const char* name : {"Code Window", "Code Window (Break)", "Standard"})
    EXPECT_NO_THROW(bars->Item(QLatin1StringView(name)));
  EXPECT_EQ(errorNumberOf([&] { bars->Item(QStringLiteral("Nenhuma")); }), ide::err::InvalidProcedureCall);

  auto popup = menuBar->Controls()->Add(ide::ControlType::Popup, 1, {}, 11, true);
  popup->setCaption(QStringLiteral("Quimbel"));
  EXPECT_EQ(menuBar->Controls()->Item(11), popup);
  EXPECT_EQ(menuBar->Controls()->Item(12)->Caption(), QStringLiteral("&Add-Ins"));
  auto item = popup->CommandBar()->Controls()->Add(ide::ControlType::Button, 1, {}, 0, true);
  item->setFace(QByteArray("png bytes"));
  EXPECT_EQ(item->Face(), QByteArray("png bytes"));
  int clicks = 0;
  auto first = vbe->Events()->CommandBarEvents(item)->Click.connect(
      [&](const ide::Ref<ide::CommandBarControl>&, bool&, bool&) { ++clicks; });
  auto second = vbe->Events()->CommandBarEvents(item)->Click.connect(
      [&](const ide::Ref<ide::CommandBarControl>&, bool&, bool&) { clicks += 10; });
  item->Execute();
  EXPECT_EQ(clicks, 11);
  const int count = menuBar->Controls()->Count();
  popup->Delete();
  EXPECT_EQ(menuBar->Controls()->Count(), count - 1);
  EXPECT_EQ(errorNumberOf([&] { popup->Delete(); }), ide::err::ObjectVariableNotSet);

  auto toolbar = bars->Add(QStringLiteral("Quimbel 2.2"), ide::BarPosition::Top, false, false);
  EXPECT_EQ(bars->Item(QStringLiteral("Quimbel 2.2")), toolbar);
  toolbar->Delete();
  EXPECT_EQ(errorNumberOf([&] { bars->Item(QStringLiteral("Quimbel 2.2")); }),
            ide::err::InvalidProcedureCall);
  EXPECT_EQ(errorNumberOf([&] { bars->Item(QStringLiteral("Standard"))->Delete(); }),
            ide::err::InvalidProcedureCall);
}

TEST(CommandBars, TheModeShowsThroughTheStandardBarsContinueAndEnd) {
  auto vbe = VbeImpl::create();
  auto standard = vbe->CommandBars()->Item(QStringLiteral("Standard"))->Controls();
  auto modeFromBar = [&] {
    if (standard->Item(QStringLiteral("CONTINUE"))->Enabled()) return ide::IdeMode::Break;
    if (standard->Item(QStringLiteral("end"))->Enabled()) return ide::IdeMode::Run;
    return ide::IdeMode::Design;
  };
  EXPECT_EQ(modeFromBar(), ide::IdeMode::Design);
  standard->Item(QStringLiteral("Start"))->Execute();
  EXPECT_EQ(vbe->mode(), ide::IdeMode::Run);
  EXPECT_EQ(modeFromBar(), ide::IdeMode::Run);
  standard->Item(QStringLiteral("Break"))->Execute();
  EXPECT_EQ(modeFromBar(), ide::IdeMode::Break);
  standard->Item(QStringLiteral("End"))->Execute();
  EXPECT_EQ(modeFromBar(), ide::IdeMode::Design);
}

TEST(CommandBars, ASinkCanCancelTheIdesOwnCommand) {
  auto vbe = VbeImpl::create();
  auto start =
      vbe->CommandBars()->Item(QStringLiteral("Standard"))->Controls()->Item(QStringLiteral("Start"));
  auto cancel = vbe->Events()->CommandBarEvents(start)->Click.connect(
      [](const ide::Ref<ide::CommandBarControl>&, bool& handled, bool& cancelDefault) {
        handled = true;
        cancelDefault = true;
      });
  start->Execute();
  EXPECT_EQ(vbe->mode(), ide::IdeMode::Design);
  cancel.disconnect();
  start->Execute();
  EXPECT_EQ(vbe->mode(), ide::IdeMode::Run);
}

// ---------------------------------------------------------------------------------------------------
// Add-ins

QString takeAddInLog() {
  QLibrary library(QStringLiteral(QUIMBEL_TEST_ADDIN));
  using TakeLog = const char* (*)();
  auto take = reinterpret_cast<TakeLog>(library.resolve("testAddInTakeLog"));
  return take ? QString::fromUtf8(take()) : QStringLiteral("no log");
}

int addInItems(const std::shared_ptr<VbeImpl>& vbe) {
  auto controls = vbe->CommandBars()->Item(QStringLiteral("Add-Ins"))->Controls();
  int count = 0;
  for (int i = 1; i <= controls->Count(); ++i)
    if (controls->Item(i)->Caption() == QLatin1StringView("Test Add-In")) ++count;
  return count;
}

TEST(AddIns, LoadAtStartupLoadLaterUnloadAndLoadAgain) {
  takeAddInLog();
  auto vbe = VbeImpl::create();
  auto addIn = vbe->addIns().registerLibrary(QStringLiteral(QUIMBEL_TEST_ADDIN), true);
  EXPECT_EQ(vbe->Addins()->Item(QStringLiteral("QuimbelTest.Connect")), addIn);
  vbe->startup();
  EXPECT_EQ(takeAddInLog(), QStringLiteral("connect 1,update,startup"));
  EXPECT_TRUE(addIn->Connect());
  EXPECT_EQ(addInItems(vbe), 1);
  vbe->manualLoop()->advance(250);
  EXPECT_EQ(takeAddInLog(), QStringLiteral("tick,tick"));

  addIn->setConnect(false);
  EXPECT_FALSE(addIn->Connect());
  vbe->manualLoop()->DoEvents();
  EXPECT_EQ(takeAddInLog(), QStringLiteral("disconnect 1"));
  EXPECT_EQ(addInItems(vbe), 0);
  EXPECT_EQ(vbe->manualLoop()->activeTimers(), 0);

  addIn->setConnect(true);
  EXPECT_EQ(takeAddInLog(), QStringLiteral("connect 0,update"));
  EXPECT_EQ(addInItems(vbe), 1);
  auto item =
      vbe->CommandBars()->Item(QStringLiteral("Add-Ins"))->Controls()->Item(QStringLiteral("Test Add-In"));
  item->Execute();
  EXPECT_EQ(takeAddInLog(), QStringLiteral("click"));
  vbe->shutdown();
  EXPECT_EQ(takeAddInLog(), QStringLiteral("disconnect 0"));
  EXPECT_EQ(addInItems(vbe), 0);
  EXPECT_EQ(addIn->connectionCount(), 2);
}

TEST(AddIns, AnAddInCanUnloadItselfFromItsOwnStartup) {
  takeAddInLog();
  qputenv("QUIMBEL_TEST_ADDIN_FAIL", "1");
  auto vbe = VbeImpl::create();
  auto addIn = vbe->addIns().registerLibrary(QStringLiteral(QUIMBEL_TEST_ADDIN), true);
  vbe->startup();
  qunsetenv("QUIMBEL_TEST_ADDIN_FAIL");
  EXPECT_FALSE(addIn->Connect());
  vbe->manualLoop()->DoEvents();
  EXPECT_EQ(takeAddInLog(), QStringLiteral("connect 1,update,startup,disconnect 1"));
  EXPECT_EQ(addInItems(vbe), 0);
}

TEST(AddIns, ALibraryThatIsNoAddInIsRefused) {
  auto vbe = VbeImpl::create();
  QString description;
  EXPECT_EQ(errorNumberOf(
                [&] { vbe->addIns().registerLibrary(QStringLiteral("/nonexistent/libnothing.so"), true); },
                &description),
            48);
  EXPECT_EQ(vbe->Addins()->Count(), 0);
}

}  // namespace
}  // namespace host
