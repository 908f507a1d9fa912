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
  return decodeAnsi(bytes).split(u"\r\n"_qs);
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
  auto clientes = componentOf(vbe, u"Loja"_qs, u"clsClientes"_qs);
  ASSERT_TRUE(clientes);
  auto module = clientes->codeModule();
  const int body = module->ProcBodyLine(u"Item"_qs, ide::ProcKind::Get);
  module->ReplaceLine(body + 1, u"    Set Item = mCol(Indice) ' alterado"_qs);
  module->InsertLines(1, u"' cabeçalho novo"_qs);
  EXPECT_TRUE(clientes->IsDirty());
  vbe->saveAll();
  const auto after = copy.snapshot();
  for (auto it = before.cbegin(); it != before.cend(); ++it) {
    if (it.key() == QLatin1StringView("Loja/clsClientes.cls")) continue;
    EXPECT_EQ(after.value(it.key()), it.value()) << it.key().toStdString();
  }
  QStringList expected = splitCrLf(before.value(u"Loja/clsClientes.cls"_qs));
  const int headerLines = expected.indexOf(u"Option Explicit"_qs);
  ASSERT_GT(headerLines, 0);
  // Code line n is file line headerLines + n, plus one for the hidden attribute line below Item's header.
  const int itemLine = expected.indexOf(u"Attribute Item.VB_UserMemId = 0"_qs);
  ASSERT_GT(itemLine, 0);
  expected[itemLine + 1] = u"    Set Item = mCol(Indice) ' alterado"_qs;
  expected.insert(headerLines, u"' cabeçalho novo"_qs);
  EXPECT_EQ(splitCrLf(after.value(u"Loja/clsClientes.cls"_qs)), expected);
  EXPECT_FALSE(clientes->IsDirty());
}

TEST(RoundTrip, GeneratedProjectsSurviveLoadAndSave) {
  QTemporaryDir dir;
  const auto generated =
      gen::generateProjects(dir.path(), {.codeLines = 60'000, .components = 40, .projects = 2, .seed = 7});
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
  const QString path = copy.path(u"Loja/modPrincipal.bas"_qs);
  const QByteArray original = readBytes(path);
  auto vbe = VbeImpl::create();
  auto project = vbe->openModuleFile(path);
  ASSERT_EQ(project->components().size(), 1u);
  EXPECT_EQ(project->FileName(), QString());
  auto module = project->components().front()->codeModule();
  module->InsertLines(module->CountOfLines() + 1, u"' fim"_qs);
  vbe->saveAll();
  const QByteArray saved = readBytes(path);
  EXPECT_EQ(saved.left(original.size()), original);
  EXPECT_EQ(saved.mid(original.size()), QByteArray("' fim\r\n"));
  EXPECT_FALSE(QFileInfo::exists(copy.path(u"Loja/Project1.vbp"_qs)));
}

// Tools that walk one module after the other read each module's code when first used and free it after.
TEST(RoundTrip, CodeReadOnDemandAnswersAsReadAtOnceAndFreedKeepsItsEdits) {
  ExampleCopy copy;
  auto atOnce = VbeImpl::create();
  atOnce->open(copy.groupFile());
  auto onDemand = VbeImpl::create();
  onDemand->setReadsCodeOnDemand(true);
  onDemand->open(copy.groupFile());
  const auto textOf = [](ComponentImpl& component) {
    auto module = component.codeModule();
    return module->Lines(1, module->CountOfLines()) + u'|' + QString::number(module->Members()->Count());
  };
  for (const auto& project : atOnce->projects())
    for (const auto& component : project->components()) {
      if (!component->hasCode()) continue;
      auto other = componentOf(onDemand, project->Name(), component->Name());
      ASSERT_TRUE(other);
      EXPECT_FALSE(other->codeModule()->isLoaded()) << other->Name().toStdString();
      EXPECT_EQ(textOf(*other), textOf(*component));
      EXPECT_EQ(other->codeModule()->Procedures(), component->codeModule()->Procedures());
    }

  // Freed unchanged, freed with edits, and kept while a code pane shows it.
  auto clientes = componentOf(onDemand, u"Loja"_qs, u"clsClientes"_qs);
  auto principal = componentOf(onDemand, u"Loja"_qs, u"modPrincipal"_qs);
  auto pedidos = componentOf(onDemand, u"Loja"_qs, u"clsPedido"_qs);
  ASSERT_TRUE(clientes && principal && pedidos);
  clientes->codeModule()->InsertLines(1, u"' editado"_qs);
  const QString edited = textOf(*clientes);
  const QString unchanged = textOf(*principal);
  pedidos->codeModule()->CodePane();
  for (const auto& component : {clientes, principal, pedidos})
    component->unloadCode();
  EXPECT_FALSE(clientes->codeModule()->isLoaded());
  EXPECT_FALSE(principal->codeModule()->isLoaded());
  EXPECT_TRUE(pedidos->codeModule()->isLoaded());
  EXPECT_TRUE(clientes->IsDirty());
  EXPECT_FALSE(principal->IsDirty());
  EXPECT_EQ(textOf(*clientes), edited);
  EXPECT_EQ(textOf(*principal), unchanged);
  onDemand->saveAll();
  EXPECT_FALSE(clientes->IsDirty());
  auto reopened = VbeImpl::create();
  reopened->open(copy.groupFile());
  EXPECT_EQ(textOf(*componentOf(reopened, u"Loja"_qs, u"clsClientes"_qs)), edited);
}

TEST(BadInput, FailuresNameTheFileAndLineAndAddNothing) {
  for (const bool onDemand : {false, true}) {
    SCOPED_TRACE(onDemand ? "read on demand" : "read at once");
    ExampleCopy copy;
    auto vbe = VbeImpl::create();
    vbe->setReadsCodeOnDemand(onDemand);
    QString description;

    EXPECT_EQ(errorNumberOf([&] { vbe->open(copy.path(u"Nada.vbp"_qs)); }, &description),
              ide::err::FileNotFound);
    EXPECT_TRUE(description.contains(u"Nada.vbp"_qs));

    // A form whose description lacks its End.
    const QString form = copy.path(u"Utilitarios/Quebrado.frm"_qs);
    writeBytes(form, "VERSION 5.00\r\nBegin VB.Form Quebrado \r\n   Caption = \"x\"\r\n");
    EXPECT_EQ(errorNumberOf([&] { vbe->open(form); }, &description), 321);
    EXPECT_TRUE(description.contains(u"Quebrado.frm, line"_qs)) << description.toStdString();

    // A line over the IDE's limit, and a file that is not text.
    const QString longLine = copy.path(u"Longa.bas"_qs);
    writeBytes(longLine, "Attribute VB_Name = \"Longa\"\r\n' ok\r\n" + QByteArray(1024, 'x') + "\r\n");
    EXPECT_EQ(errorNumberOf([&] { vbe->open(longLine); }, &description), 321);
    EXPECT_TRUE(description.contains(u"Longa.bas, line 3"_qs)) << description.toStdString();
    const QString binary = copy.path(u"Binario.bas"_qs);
    writeBytes(binary, QByteArray("Attribute VB_Name = \"B\"\r\n\0\1\2", 28));
    EXPECT_EQ(errorNumberOf([&] { vbe->open(binary); }, &description), 321);

    EXPECT_EQ(vbe->VBProjects()->Count(), 0);
  }
}

TEST(MessyProjects, EntriesKeepTheirSpellingAndMissingFilesTheirLines) {
  QTemporaryDir dir;
  const QString file = test::writeMessyProject(dir.path());
  const QByteArray original = readBytes(file);
  writeBytes(dir.filePath(u"Grupo.vbg"_qs),
             "VBGROUP 5.0\r\nStartupProject=entrada.VBP\r\nProject=Outro\\Falta.vbp\r\n");
  auto vbe = VbeImpl::create();
  auto project = vbe->open(dir.filePath(u"Grupo.vbg"_qs)).at(0);
  EXPECT_EQ(project->Count(), 3);
  QStringList missing;
  for (const MissingFile& entry : vbe->missingFiles())
    missing << u"%1: %2"_qs.arg(entry.line).arg(entry.entry);
  EXPECT_EQ(missing, QStringList({u"3: Outro\\Falta.vbp"_qs, u"4: Classes\\clsFalta.cls"_qs}));
  // A change touches its own entry only (the entries after the missing one still find their lines).
  project->component(u"modMisto"_qs)->setName(u"modAntigo"_qs);
  project->Remove(project->component(u"modEntrada"_qs));
  vbe->saveAll();
  QByteArray expected = original;
  expected.replace("Module=modEntrada; FONTES\\ModEntrada.bas\r\n", "")
      .replace("Module=modMisto;", "Module=modAntigo;");
  EXPECT_EQ(readBytes(file), expected);
}

TEST(Saving, AWriteThatCannotBeDoneSaysWhatFailedAndKeepsTheChanges) {
  ExampleCopy copy;
  auto vbe = VbeImpl::create();
  auto project = vbe->openProject(copy.path(u"Utilitarios/Utilitarios.vbp"_qs));
  auto component = project->component(u"modApi"_qs);
  component->codeModule()->InsertLines(1, u"' x"_qs);
  // A directory where the file should be: no write can replace it, not even root's.
  const QString path = copy.path(u"Utilitarios/modApi.bas"_qs);
  QFile::remove(path);
  ASSERT_TRUE(QDir().mkpath(path + u"/in-the-way"_qs));
  QString description;
  EXPECT_EQ(errorNumberOf([&] { vbe->saveAll(); }, &description), ide::err::PathFileAccessError);
  EXPECT_TRUE(description.contains(u"modApi.bas"_qs)) << description.toStdString();
  EXPECT_TRUE(QFileInfo(path + u"/in-the-way"_qs).isDir());
  EXPECT_TRUE(component->IsDirty());
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
          entries << u"file %1 %2 -> %3"_qs.arg(static_cast<int>(type))
                         .arg(QFileInfo(oldName).filePath(), newName);
        }));
  }
};

TEST(Events, OpeningAddingRenamingAndRemovingFireInOrder) {
  ExampleCopy copy;
  auto vbe = VbeImpl::create();
  EventLog log;
  log.attach(vbe);
  auto project = vbe->openProject(copy.path(u"Utilitarios/Utilitarios.vbp"_qs));
  auto added = project->VBComponents()->Add(ide::ComponentType::StdModule);
  EXPECT_EQ(added->Name(), u"Module1"_qs);
  added->setName(u"modNovo"_qs);
  project->VBComponents()->Remove(added);
  const QStringList expected = {u"project added Utilitarios"_qs, u"project activated Utilitarios"_qs,
                                u"added Module1"_qs, u"renamed Module1 modNovo"_qs,
                                u"removed modNovo (present)"_qs};
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
    if (c->Name() == QLatin1StringView("Module1")) c->setName(u"Primeiro"_qs);
    order << "added done " + c->Name();
  });
  auto onRenamed =
      components->ItemRenamed.connect([&](const ide::Ref<ide::VBComponent>& c, const QString& old) {
        order << "renamed " + old + " " + c->Name();
      });
  vbe->newProject()->VBComponents()->Add(ide::ComponentType::StdModule);
  const QStringList expected = {u"added Module1"_qs, u"renamed Module1 Primeiro"_qs,
                                u"added done Primeiro"_qs};
  EXPECT_EQ(order, expected);
}

TEST(Components, NamesAreCheckedAndRenamesReachTheFiles) {
  ExampleCopy copy;
  auto vbe = VbeImpl::create();
  auto project = vbe->openProject(copy.path(u"Loja/Loja.vbp"_qs));
  auto module = project->component(u"modConstantes"_qs);
  EXPECT_EQ(errorNumberOf([&] { module->setName(u"modPrincipal"_qs); }), ide::err::NameConflict);
  EXPECT_EQ(errorNumberOf([&] { module->setName(u"2mod"_qs); }), ide::err::InvalidName);
  EXPECT_EQ(errorNumberOf([&] { module->setName(u"Loja"_qs); }), ide::err::NameConflict);
  module->setName(u"modValores"_qs);
  auto form = project->component(u"frmCliente"_qs);
  form->setName(u"frmClienteNovo"_qs);
  vbe->saveAll();
  const QString vbp = decodeAnsi(readBytes(copy.path(u"Loja/Loja.vbp"_qs)));
  EXPECT_TRUE(vbp.contains(u"Module=modValores; modConstantes.bas\r\n"_qs));
  const QString bas = decodeAnsi(readBytes(copy.path(u"Loja/modConstantes.bas"_qs)));
  EXPECT_TRUE(bas.startsWith(u"Attribute VB_Name = \"modValores\"\r\n"_qs));
  const QString frm = decodeAnsi(readBytes(copy.path(u"Loja/frmCliente.frm"_qs)));
  EXPECT_TRUE(frm.contains(u"Begin VB.Form frmClienteNovo "_qs));
  EXPECT_TRUE(frm.contains(u"Attribute VB_Name = \"frmClienteNovo\""_qs));
}

TEST(Components, NewComponentsAreSavedBesideTheProject) {
  QTemporaryDir dir;
  auto vbe = VbeImpl::create();
  auto project = vbe->newProject();
  EXPECT_EQ(project->FileName(), QString());
  auto module = project->VBComponents()->Add(ide::ComponentType::StdModule);
  module->CodeModule()->AddFromString(u"Option Explicit\r\nPublic Sub Main()\r\nEnd Sub"_qs);
  auto form = project->VBComponents()->Add(ide::ComponentType::VBForm);
  auto klass = project->VBComponents()->Add(ide::ComponentType::ClassModule);
  EXPECT_EQ(module->FileNames(1), QString());
  const QString path = dir.filePath(u"Novo.vbp"_qs);
  project->SaveAs(path);
  EXPECT_EQ(project->FileName(), path);
  EXPECT_EQ(module->FileNames(1), dir.filePath(u"Module1.bas"_qs));
  EXPECT_EQ(
      readBytes(module->FileNames(1)),
      QByteArray("Attribute VB_Name = \"Module1\"\r\nOption Explicit\r\nPublic Sub Main()\r\nEnd Sub\r\n"));
  EXPECT_TRUE(readBytes(form->FileNames(1)).startsWith("VERSION 5.00\r\nBegin VB.Form Form1 \r\n"));
  EXPECT_TRUE(readBytes(klass->FileNames(1)).startsWith("VERSION 1.0 CLASS\r\n"));
  const QString vbp = decodeAnsi(readBytes(path));
  EXPECT_TRUE(vbp.contains(u"Module=Module1; Module1.bas\r\n"_qs));
  EXPECT_TRUE(vbp.contains(u"Form=Form1.frm\r\n"_qs));
  EXPECT_TRUE(vbp.contains(u"Class=Class1; Class1.cls\r\n"_qs));
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
  auto project = vbe->openProject(copy.path(u"Utilitarios/Utilitarios.vbp"_qs));
  const QString oldPath = project->FileName();
  const QString newPath = elsewhere.filePath(u"Util2.vbp"_qs);
  log.entries.clear();
  project->SaveAs(newPath);
  ASSERT_EQ(log.entries.size(), 1);
  EXPECT_EQ(log.entries[0], u"file 3 %1 -> %2"_qs.arg(oldPath, newPath));
  // The components stay where they are; the new project file refers to them from its folder.
  const QString vbp = decodeAnsi(readBytes(newPath));
  EXPECT_TRUE(vbp.contains(u"modApi.bas"_qs));
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
  auto util = vbe->project(u"Utilitarios"_qs);
  util->setName(u"Util"_qs);
  EXPECT_EQ(errorNumberOf([&] { util->setName(u"Loja"_qs); }), ide::err::NameConflict);
  vbe->VBProjects()->Remove(util);
  // The project that remains becomes the active one.
  const QStringList expected = {u"project renamed Utilitarios Util"_qs, u"project removed Util with 3"_qs,
                                u"project activated Loja"_qs};
  EXPECT_EQ(log.entries, expected);
  EXPECT_EQ(vbe->VBProjects()->Count(), 1);
  EXPECT_EQ(vbe->ActiveVBProject()->Name(), u"Loja"_qs);
  EXPECT_EQ(errorNumberOf([&] { util->Collection(); }), ide::err::ObjectVariableNotSet);
}

// ---------------------------------------------------------------------------------------------------
// Windows, panes, focus

TEST(Windows, ACodePaneOpensItsWindowAndBecomesActive) {
  ExampleCopy copy;
  auto vbe = VbeImpl::create();
  vbe->open(copy.groupFile());
  EXPECT_FALSE(vbe->ActiveCodePane());
  auto module = componentOf(vbe, u"Loja"_qs, u"modPrincipal"_qs)->CodeModule();
  auto pane = module->CodePane();
  EXPECT_EQ(pane, module->CodePane());
  pane->Show();
  EXPECT_EQ(vbe->ActiveCodePane(), pane);
  EXPECT_EQ(vbe->ActiveWindow(), pane->Window());
  EXPECT_EQ(pane->Window()->Caption(), u"Loja - modPrincipal (Code)"_qs);
  EXPECT_EQ(pane->Window()->Type(), ide::WindowType::CodeWindow);
  EXPECT_EQ(vbe->SelectedVBComponent(), module->Parent());
  auto& windows = vbe->Platform().windows();
  EXPECT_EQ(windows.GetFocus(), pane->Window()->hWnd());
  // In MDI display code windows live in the main window's MDI client.
  const ide::HWnd client = windows.FindWindowEx(vbe->MainWindow()->hWnd(), 0, u"MDIClient"_qs, {});
  EXPECT_EQ(windows.FindWindowEx(client, 0, u"VbaWindow"_qs, pane->Window()->Caption()),
            pane->Window()->hWnd());
}

TEST(Windows, ClosingTheActiveCodeWindowActivatesTheNextAndSendsDestroy) {
  ExampleCopy copy;
  auto vbe = VbeImpl::create();
  vbe->open(copy.groupFile());
  const int toolWindows = vbe->Windows()->Count();
  auto first = componentOf(vbe, u"Loja"_qs, u"modPrincipal"_qs)->CodeModule()->CodePane();
  auto second = componentOf(vbe, u"Loja"_qs, u"clsCliente"_qs)->CodeModule()->CodePane();
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
  auto module = componentOf(vbe, u"Loja"_qs, u"modPrincipal"_qs)->codeModule();
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
  module->InsertLines(1, u"' a\r\n' b"_qs);
  pane->GetSelection(sl, sc, el, ec);
  EXPECT_EQ((std::array{sl, sc, el, ec}), (std::array{12, 1, 12, 4}));
}

TEST(Windows, SdiDisplayPutsCodeWindowsAtTheTopLevel) {
  ExampleCopy copy;
  IdeOptions options;
  options.displayModel = ide::DisplayModel::SDI;
  auto vbe = VbeImpl::create(std::move(options));
  vbe->open(copy.groupFile());
  auto pane = componentOf(vbe, u"Loja"_qs, u"modPrincipal"_qs)->CodeModule()->CodePane();
  pane->Show();
  EXPECT_EQ(vbe->DisplayModel(), ide::DisplayModel::SDI);
  EXPECT_EQ(vbe->Platform().windows().FindWindowEx(0, 0, u"VbaWindow"_qs, pane->Window()->Caption()),
            pane->Window()->hWnd());
}

// ---------------------------------------------------------------------------------------------------
// Members

TEST(Members, TheDefaultMemberIsTheOneWithProcedureIdZero) {
  ExampleCopy copy;
  auto vbe = VbeImpl::create();
  vbe->open(copy.groupFile());
  auto clientes = componentOf(vbe, u"Loja"_qs, u"clsClientes"_qs);
  auto members = clientes->CodeModule()->Members();
  EXPECT_EQ(members->Item(u"Item"_qs)->ProcedureId(), 0);
  EXPECT_EQ(members->Item(u"Item"_qs)->Type(), ide::MemberType::Property);
  EXPECT_FALSE(members->Item(u"Add"_qs)->ProcedureId());
  members->Item(u"Item"_qs)->setProcedureId(1234);
  members->Item(u"Add"_qs)->setProcedureId(0);
  clientes->save();
  const QString cls = decodeAnsi(readBytes(copy.path(u"Loja/clsClientes.cls"_qs)));
  EXPECT_TRUE(
      cls.contains(QStringLiteral("Public Property Get Item(ByVal Indice As Variant) As "
                                  "clsCliente\r\nAttribute Item.VB_UserMemId = 1234\r\n")));
  EXPECT_TRUE(cls.contains(u"As clsCliente\r\nAttribute Add.VB_UserMemId = 0\r\n"_qs));
  EXPECT_EQ(errorNumberOf([&] { members->Item(u"Nenhum"_qs); }), ide::err::SubscriptOutOfRange);
}

// ---------------------------------------------------------------------------------------------------
// Designers

TEST(Designers, ControlsPropertiesAndArraysAsTheFormDescribesThem) {
  ExampleCopy copy;
  auto vbe = VbeImpl::create();
  vbe->open(copy.groupFile());
  auto principal = componentOf(vbe, u"Loja"_qs, u"frmPrincipal"_qs);
  ASSERT_TRUE(principal->Designer());
  EXPECT_EQ(principal->Type(), ide::ComponentType::VBForm);
  EXPECT_EQ(principal->Properties()->Item(u"MDIChild"_qs)->Value(), QVariant(false));
  int menus = 0;
  for (const auto& control : principal->Designer()->VBControls()->items())
    if (control->ClassName() == QLatin1StringView("Menu")) ++menus;
  EXPECT_GE(menus, 3);

  // cmdAcao(0 to 2) and optTipo(0 to 1), the latter inside the frame fraTipo.
  auto cliente = componentOf(vbe, u"Loja"_qs, u"frmCliente"_qs);
  QStringList elements;
  for (const auto& control : cliente->Designer()->VBControls()->items()) {
    const int index = control->Properties()->Item(u"Index"_qs)->Value().toInt();
    if (index >= 0) elements << u"%1(%2)"_qs.arg(control->name()).arg(index);
    if (control->name() == QLatin1StringView("optTipo")) {
      EXPECT_EQ(control->Container()->name(), u"fraTipo"_qs);
    }
  }
  EXPECT_EQ(elements, (QStringList{u"cmdAcao(2)"_qs, u"cmdAcao(1)"_qs, u"cmdAcao(0)"_qs, u"optTipo(1)"_qs,
                                   u"optTipo(0)"_qs}));
  auto txtNome = cliente->Designer()->VBControls()->Item(u"txtNome"_qs);
  EXPECT_EQ(txtNome->Properties()->Item(u"Index"_qs)->Value(), QVariant::fromValue(qint16(-1)));
}

TEST(Designers, AddingRenamingAndRemovingControlsFireEventsAndReachTheFile) {
  ExampleCopy copy;
  auto vbe = VbeImpl::create();
  vbe->open(copy.groupFile());
  auto component = componentOf(vbe, u"Loja"_qs, u"frmCliente"_qs);
  auto designer = component->Designer();
  QStringList events;
  auto source = vbe->Events()->VBControlsEvents(component->project(), designer);
  auto a =
      source->ItemAdded.connect([&](const ide::Ref<ide::VBControl>& c) { events << "added " + c->name(); });
  auto r =
      source->ItemRenamed.connect([&](const ide::Ref<ide::VBControl>& c, const QString& old, int oldIndex) {
        events << u"renamed %1(%2) %3(%4)"_qs.arg(old).arg(oldIndex).arg(c->name()).arg(
            c->Properties()->Item(u"Index"_qs)->Value().toInt());
      });
  auto d = source->ItemRemoved.connect(
      [&](const ide::Ref<ide::VBControl>& c) { events << "removed " + c->name(); });

  auto box = designer->VBControls()->Add(u"VB.TextBox"_qs);
  EXPECT_EQ(box->ClassName(), u"TextBox"_qs);
  EXPECT_EQ(box->Properties()->Item(u"Text"_qs)->Value(), QVariant(u"Text1"_qs));
  EXPECT_EQ(box->Properties()->Item(u"MaxLength"_qs)->Value(), QVariant(qint32(0)));
  box->Properties()->Item(u"Name"_qs)->setValue(u"txtApelido"_qs);
  box->Properties()->Item(u"Index"_qs)->setValue(0);
  box->Properties()->Item(u"MaxLength"_qs)->setValue(u"5"_qs);
  EXPECT_EQ(box->Properties()->Item(u"MaxLength"_qs)->Value(), QVariant(qint32(5)));
  EXPECT_EQ(errorNumberOf([&] { box->Properties()->Item(u"MaxLength"_qs)->setValue(u"abc"_qs); }), 380);
  box->Properties()->Item(u"Locked"_qs)->setValue(-1);
  const QStringList expected = {u"added Text1"_qs, u"renamed Text1(-1) txtApelido(-1)"_qs,
                                u"renamed txtApelido(-1) txtApelido(0)"_qs};
  EXPECT_EQ(events, expected);
  component->save();
  const QString frm = decodeAnsi(readBytes(copy.path(u"Loja/frmCliente.frm"_qs)));
  EXPECT_TRUE(frm.contains(u"   Begin VB.TextBox txtApelido \r\n"_qs));
  EXPECT_TRUE(frm.contains(u"      Locked          =   -1  'True\r\n"_qs));
  EXPECT_TRUE(frm.contains(u"      MaxLength       =   5\r\n"_qs));
  events.clear();
  designer->VBControls()->Remove(box);
  EXPECT_EQ(events, QStringList{u"removed txtApelido"_qs});
  EXPECT_EQ(errorNumberOf([&] { box->ClassName(); }), ide::err::ObjectVariableNotSet);
}

TEST(Designers, NewControlsGetOnlyThePropertiesTheirClassHas) {
  auto vbe = VbeImpl::create();
  auto form = vbe->newProject()->VBComponents()->Add(ide::ComponentType::VBForm);
  auto controls = form->Designer()->VBControls();
  auto timer = std::dynamic_pointer_cast<ControlImpl>(controls->Add(u"VB.Timer"_qs));
  auto line = std::dynamic_pointer_cast<ControlImpl>(controls->Add(u"Line"_qs));
  auto label = std::dynamic_pointer_cast<ControlImpl>(controls->Add(u"Label"_qs));
  EXPECT_EQ(timer->node()->propertyNames(), (QStringList{u"Left"_qs, u"Top"_qs}));
  EXPECT_FALSE(line->node()->property(u"Width"_qs));
  EXPECT_FALSE(line->node()->property(u"Caption"_qs));
  EXPECT_EQ(label->node()->property(u"Caption"_qs), u"\"Label1\""_qs);
  EXPECT_TRUE(label->node()->property(u"Height"_qs));
}

TEST(Designers, SelectionChangesAreAnnounced) {
  ExampleCopy copy;
  auto vbe = VbeImpl::create();
  vbe->open(copy.groupFile());
  auto component = componentOf(vbe, u"Loja"_qs, u"frmCliente"_qs);
  auto form = component->form();
  QStringList events;
  auto source = vbe->Events()->SelectedVBControlsEvents(component->project(), form);
  auto a = source->ItemAdded.connect([&](const ide::Ref<ide::VBControl>& c) { events << "+" + c->name(); });
  auto r = source->ItemRemoved.connect([&](const ide::Ref<ide::VBControl>& c) { events << "-" + c->name(); });
  auto nome = form->findControl(u"txtNome"_qs);
  auto email = form->findControl(u"txtEmail"_qs);
  form->setSelection({nome, email});
  form->setSelection({email});
  EXPECT_EQ(events, (QStringList{u"+txtNome"_qs, u"+txtEmail"_qs, u"-txtNome"_qs}));
  EXPECT_EQ(form->SelectedVBControls()->Count(), 1);
}

TEST(Events, FilesWrittenAddedAndRemovedAreAnnounced) {
  ExampleCopy copy;
  auto vbe = VbeImpl::create();
  auto project = vbe->openProject(copy.path(u"Utilitarios/Utilitarios.vbp"_qs));
  QStringList events;
  auto files = vbe->Events()->FileControlEvents(project);
  auto w = files->AfterWriteFile.connect([&](const ide::Ref<ide::VBProject>&, ide::FileType type,
                                             const QString& name, int result) {
    events << u"write %1 %2 %3"_qs.arg(static_cast<int>(type)).arg(QFileInfo(name).fileName()).arg(result);
  });
  auto add = files->AfterAddFile.connect(
      [&](const ide::Ref<ide::VBProject>&, ide::FileType type, const QString& name) {
        events << u"add %1 %2"_qs.arg(static_cast<int>(type)).arg(QFileInfo(name).fileName());
      });
  auto rem = files->AfterRemoveFile.connect(
      [&](const ide::Ref<ide::VBProject>&, ide::FileType type, const QString& name) {
        events << u"remove %1 %2"_qs.arg(static_cast<int>(type)).arg(QFileInfo(name).fileName());
      });
  project->component(u"modApi"_qs)->codeModule()->InsertLines(1, u"' x"_qs);
  vbe->saveAll();
  auto added = project->VBComponents()->AddFile(copy.path(u"Loja/modConstantes.bas"_qs));
  project->VBComponents()->Remove(added);
  EXPECT_EQ(events, (QStringList{u"write 1 modApi.bas 0"_qs, u"add 1 modConstantes.bas"_qs,
                                 u"remove 1 modConstantes.bas"_qs}));
  events.clear();
  vbe->saveAll();  // the project file changed (a component came and went)
  EXPECT_EQ(events, QStringList{u"write 3 Utilitarios.vbp 0"_qs});
}

// ---------------------------------------------------------------------------------------------------
// Command bars and the IDE mode

TEST(CommandBars, TheIdesBarsAreThereAndControlsComeAndGo) {
  auto vbe = VbeImpl::create();
  auto bars = vbe->CommandBars();
  auto menuBar = bars->Item(u"Menu Bar"_qs);
  ASSERT_GE(menuBar->Controls()->Count(), 11);
  EXPECT_EQ(menuBar->Controls()->Item(11)->Caption(), u"&Add-Ins"_qs);
  auto addIns = bars->Item(u"Add-Ins"_qs);
  EXPECT_EQ(addIns, menuBar->Controls()->Item(11)->CommandBar());
  for (const char* name : {"Code Window", "Code Window (Break)", "Standard"})
    EXPECT_NO_THROW(bars->Item(QLatin1StringView(name)));
  EXPECT_EQ(errorNumberOf([&] { bars->Item(u"Nenhuma"_qs); }), ide::err::InvalidProcedureCall);

  auto popup = menuBar->Controls()->Add(ide::ControlType::Popup, 1, {}, 11, true);
  popup->setCaption(u"Quimbel"_qs);
  EXPECT_EQ(menuBar->Controls()->Item(11), popup);
  EXPECT_EQ(menuBar->Controls()->Item(12)->Caption(), u"&Add-Ins"_qs);
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

  auto toolbar = bars->Add(u"Quimbel 2.2"_qs, ide::BarPosition::Top, false, false);
  EXPECT_EQ(bars->Item(u"Quimbel 2.2"_qs), toolbar);
  toolbar->Delete();
  EXPECT_EQ(errorNumberOf([&] { bars->Item(u"Quimbel 2.2"_qs); }), ide::err::InvalidProcedureCall);
  EXPECT_EQ(errorNumberOf([&] { bars->Item(u"Standard"_qs)->Delete(); }), ide::err::InvalidProcedureCall);
}

TEST(CommandBars, TheModeShowsThroughTheStandardBarsContinueAndEnd) {
  auto vbe = VbeImpl::create();
  auto standard = vbe->CommandBars()->Item(u"Standard"_qs)->Controls();
  auto modeFromBar = [&] {
    if (standard->Item(u"CONTINUE"_qs)->Enabled()) return ide::IdeMode::Break;
    if (standard->Item(u"end"_qs)->Enabled()) return ide::IdeMode::Run;
    return ide::IdeMode::Design;
  };
  EXPECT_EQ(modeFromBar(), ide::IdeMode::Design);
  standard->Item(u"Start"_qs)->Execute();
  EXPECT_EQ(vbe->mode(), ide::IdeMode::Run);
  EXPECT_EQ(modeFromBar(), ide::IdeMode::Run);
  standard->Item(u"Break"_qs)->Execute();
  EXPECT_EQ(modeFromBar(), ide::IdeMode::Break);
  standard->Item(u"End"_qs)->Execute();
  EXPECT_EQ(modeFromBar(), ide::IdeMode::Design);
}

TEST(CommandBars, ASinkCanCancelTheIdesOwnCommand) {
  auto vbe = VbeImpl::create();
  auto start = vbe->CommandBars()->Item(u"Standard"_qs)->Controls()->Item(u"Start"_qs);
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
  return take ? QString::fromUtf8(take()) : u"no log"_qs;
}

int addInItems(const std::shared_ptr<VbeImpl>& vbe) {
  auto controls = vbe->CommandBars()->Item(u"Add-Ins"_qs)->Controls();
  int count = 0;
  for (int i = 1; i <= controls->Count(); ++i)
    if (controls->Item(i)->Caption() == QLatin1StringView("Test Add-In")) ++count;
  return count;
}

TEST(AddIns, LoadAtStartupLoadLaterUnloadAndLoadAgain) {
  takeAddInLog();
  auto vbe = VbeImpl::create();
  auto addIn = vbe->addIns().registerLibrary(QStringLiteral(QUIMBEL_TEST_ADDIN), true);
  EXPECT_EQ(vbe->Addins()->Item(u"QuimbelTest.Connect"_qs), addIn);
  vbe->startup();
  EXPECT_EQ(takeAddInLog(), u"connect 1,update,startup"_qs);
  EXPECT_TRUE(addIn->Connect());
  EXPECT_EQ(addInItems(vbe), 1);
  vbe->manualLoop()->advance(250);
  EXPECT_EQ(takeAddInLog(), u"tick,tick"_qs);

  addIn->setConnect(false);
  EXPECT_FALSE(addIn->Connect());
  vbe->manualLoop()->DoEvents();
  EXPECT_EQ(takeAddInLog(), u"disconnect 1"_qs);
  EXPECT_EQ(addInItems(vbe), 0);
  EXPECT_EQ(vbe->manualLoop()->activeTimers(), 0);

  addIn->setConnect(true);
  EXPECT_EQ(takeAddInLog(), u"connect 0,update"_qs);
  EXPECT_EQ(addInItems(vbe), 1);
  auto item = vbe->CommandBars()->Item(u"Add-Ins"_qs)->Controls()->Item(u"Test Add-In"_qs);
  item->Execute();
  EXPECT_EQ(takeAddInLog(), u"click"_qs);
  vbe->shutdown();
  EXPECT_EQ(takeAddInLog(), u"disconnect 0"_qs);
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
  EXPECT_EQ(takeAddInLog(), u"connect 1,update,startup,disconnect 1"_qs);
  EXPECT_EQ(addInItems(vbe), 0);
}

TEST(AddIns, ALibraryThatIsNoAddInIsRefused) {
  auto vbe = VbeImpl::create();
  QString description;
  EXPECT_EQ(errorNumberOf([&] { vbe->addIns().registerLibrary(u"/nonexistent/libnothing.so"_qs, true); },
                          &description),
            48);
  EXPECT_EQ(vbe->Addins()->Count(), 0);
}

}  // namespace
}  // namespace host
