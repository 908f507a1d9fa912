// SPDX-License-Identifier: MIT
// The extended find over a headless IDE: the rows a search lists, its scopes, the removal of rows, the way
// to an occurrence, and the window on the offscreen platform (stop, close, wildcards, failures).
#include "common/strings.h"
#include "find/frmfind.h"
#include "find/navigate.h"
#include "host/platform/headlessui.h"
#include "host/platform/manualloop.h"
#include "modelfixture.h"
#include "printers.h"
#include "testproject.h"

#include <gtest/gtest.h>

#include <QCheckBox>
#include <QLabel>
#include <QLineEdit>
#include <QPointer>
#include <QPushButton>
#include <QRadioButton>
#include <QTest>
#include <QTreeView>

namespace find {
namespace {

// Two projects, like the code programmers search: line numbers, labels, GoTo, accented text.
const QStringList kPedidos = {
    u"Option Explicit"_qs,
    u"Private Const MARCA As String = \"aaaa\""_qs,  // 2: three "aa" in the declarations
    QString(),
    u"Public Function Total(ByVal Valor As Currency) As Currency"_qs,
    u"10    On Error GoTo Erro"_qs,
    u"20    Total = Valor * 1.1 ' acréscimo"_qs,
    u"      Exit Function"_qs,
    u"Erro:"_qs,
    u"\t30  Total = 0   "_qs,  // 9
    u"End Function"_qs,
};
const QStringList kDatas = {u"Sub Somar()"_qs, u"  total = TOTAL + 1"_qs, u"End Sub"_qs};

struct Scene {
  transform::test::Ide ide;  // Project1, the active one
  ide::Ref<ide::CodeModule> pedidos = ide.addModule(kPedidos);
  std::shared_ptr<host::ProjectImpl> other = ide.vbe->newProject();
  ide::Ref<ide::CodeModule> datas = other->Add(ide::ComponentType::StdModule)->CodeModule();

  Scene() {
    datas->AddFromString(kDatas.join(u"\r\n"_qs));
    ide.vbe->setActiveVBProject(ide.project);
    ide.vbe->selectComponent(std::dynamic_pointer_cast<host::ComponentImpl>(pedidos->Parent()));
  }
  host::HeadlessUi& ui() { return *ide.vbe->headlessUi(); }
  host::ManualEventLoop& loop() { return *ide.vbe->manualLoop(); }
  QStringList boxes() {
    QStringList shown;
    for (const auto& box : ui().messageBoxes())
      shown << u"%1 %2"_qs.arg(box.style).arg(box.prompt);
    return shown;
  }
};

/// A row as one text: project | module | procedure | start line:column-end column | text.
QString rowText(const FoundRow& row) {
  return u"%1|%2|%3|%4:%5-%6|%7"_qs.arg(row.project, row.module, row.procedure)
      .arg(row.item.startline)
      .arg(row.item.startcol)
      .arg(row.item.endcol)
      .arg(row.text);
}

struct Recorder final : FindReport {
  QStringList rows;
  QStringList labels;
  void status(const QString&) override {}
  void resultsLabel(const QString& text) override { labels << text; }
  void found(FoundRow row) override { rows << rowText(row); }
};

QStringList search(Scene& scene, SearchScope scope, const FindOptions& options,
                   QStringList* labels = nullptr) {
  Recorder recorder;
  walk::WalkContext context(u"test"_qs, &scene.loop(), nullptr);
  FindWalk(context, *scene.ide.vbe, recorder).Search(scope, options);
  if (labels) *labels = recorder.labels;
  return recorder.rows;
}

TEST(FindWalk, ListsOverlappingOccurrencesWithTheirProcedureAndTrimmedLine) {
  Scene scene;
  QStringList labels;
  EXPECT_EQ(search(scene, SearchScope::AllProjects, {u"aa"_qs}, &labels),
            (QStringList{u"Project1|Module1|(Declarations)|2:34-36|"_qs + kPedidos[1],
                         u"Project1|Module1|(Declarations)|2:35-37|"_qs + kPedidos[1],
                         u"Project1|Module1|(Declarations)|2:36-38|"_qs + kPedidos[1]}));
  EXPECT_EQ(labels, (QStringList{u"Resultados da pesquisa em Project1"_qs,
                                 u"Resultados da pesquisa em Project2"_qs}));
  EXPECT_EQ(search(scene, SearchScope::AllProjects, {u"total = "_qs, false, false, false}),
            (QStringList{u"Project1|Module1|Total|6:7-15|20    Total = Valor * 1.1 ' acréscimo"_qs,
                         u"Project1|Module1|Total|9:6-14|30  Total = 0"_qs,
                         u"Project2|Module1|Somar|2:3-11|total = TOTAL + 1"_qs}));
}

TEST(FindWalk, SearchesTheScopeTheOptionButtonsChoose) {
  Scene scene;
  const FindOptions total{u"Total"_qs, true, true, false};
  EXPECT_EQ(search(scene, SearchScope::ActiveProject, total).size(), 3);
  EXPECT_EQ(search(scene, SearchScope::ActiveModule, total).size(), 3);
  scene.ide.vbe->setActiveVBProject(scene.other);
  scene.ide.vbe->selectComponent(std::dynamic_pointer_cast<host::ComponentImpl>(scene.datas->Parent()));
  EXPECT_TRUE(search(scene, SearchScope::ActiveProject, total).isEmpty());  // "TOTAL", "total"
  EXPECT_EQ(search(scene, SearchScope::ActiveModule, {u"total"_qs, true}).size(), 2);
  scene.ide.vbe->selectComponent(nullptr);
  EXPECT_TRUE(search(scene, SearchScope::ActiveModule, total).isEmpty());
}

TEST(FindResults, RemovalTakesTheRowsOfAModuleOrProjectAndKeepsTheOtherKeys) {
  Scene scene;
  FindResults results;
  for (const char* project : {"Loja", "Dados", "Loja"})
    for (const char* module : {"modA", "modB", "modA"})
      results.add({QString::fromLatin1(project),
                   QString::fromLatin1(module),
                   {},
                   {},
                   {*project == 'L' ? scene.ide.project : scene.other}});
  EXPECT_EQ(results.RemoveItemsOfComponent(u"modA"_qs, scene.ide.project), 4);  // not Dados's modA
  EXPECT_EQ(results.rowCount(), 5);
  EXPECT_EQ(results.keyOf(0), u"_2"_qs);
  EXPECT_EQ(results.keyOf(4), u"_8"_qs);
  EXPECT_EQ(results.item(u"_1"_qs), nullptr);
  EXPECT_NE(results.item(u"_6"_qs), nullptr);
  EXPECT_EQ(results.RemoveItemsOfProject(u"Loja"_qs), 2);
  EXPECT_EQ(results.keyOf(0), u"_4"_qs);
  results.clear();
  EXPECT_EQ(results.add({}), u"_1"_qs);
  EXPECT_EQ(results.headerData(3, Qt::Horizontal).toString(), u"Texto Localizado"_qs);
}

TEST(Navigation, ShowsTheOccurrenceWithHalfAPaneAboveItOrAtTheTop) {
  EXPECT_EQ(TopLineFor(3, 40), 3);
  EXPECT_EQ(TopLineFor(21, 40), 1);
  EXPECT_EQ(TopLineFor(100, 41), 80);
  Scene scene;
  for (int i = 0; i < 200; ++i)
    scene.pedidos->InsertLines(1, u"' linha"_qs);
  const CItemFound item{scene.ide.project, scene.pedidos->Parent(), 206, 7, 206, 12};
  bool minimised = false;
  ShowItemFound(*scene.ide.vbe, item, [&] { minimised = true; });
  auto pane = scene.pedidos->CodePane();
  EXPECT_TRUE(minimised);
  EXPECT_EQ(scene.ide.vbe->ActiveCodePane(), pane);
  EXPECT_EQ(pane->TopLine(), 206 - pane->CountOfVisibleLines() / 2);
  int sl = 0, sc = 0, el = 0, ec = 0;
  pane->GetSelection(sl, sc, el, ec);
  EXPECT_EQ((std::array{sl, sc, el, ec}), (std::array{206, 7, 206, 12}));

  // A project closed behind the window's back, then a module removed.
  scene.ide.vbe->removeProject(scene.other);
  ShowItemFound(*scene.ide.vbe, {scene.other, scene.datas->Parent(), 1, 1, 1, 2}, {});
  scene.ide.project->Remove(scene.pedidos->Parent());
  ShowItemFound(*scene.ide.vbe, item, {});
  EXPECT_EQ(
      scene.boxes(),
      (QStringList{u"64 O item seleciondado pertence a um projeto não localizado."_qs,
                   QStringLiteral("64 Não foi possível abrir a janela de código de \"Module1\" no projeto "
                                  "ativo.")}));
}

// ---------------------------------------------------------------------------------------------------
// The window

struct Window {
  Scene scene;
  frmFind form{scene.ide.vbe};
  Window() {
    form.Show();
    form.txtSearch()->setText(u"Total"_qs);
  }
  QStringList keys() {
    QStringList shown;
    for (int i = 0; i < form.results().rowCount(); ++i)
      shown << form.results().keyOf(i);
    return shown;
  }
};

TEST(FindWindow, AnEmptyTextDoesNothingAndTheRowsStay) {
  Window window;
  EXPECT_EQ(window.form.windowTitle(), u"Quimbel - Localizar Estendido"_qs);
  window.form.cmdFind()->click();
  EXPECT_EQ(window.keys(), (QStringList{u"_1"_qs, u"_2"_qs, u"_3"_qs, u"_4"_qs, u"_5"_qs}));
  EXPECT_EQ(window.form.statusText(), u"Pesquisa completada ... 5 linhas localizadas"_qs);
  EXPECT_EQ(window.form.lblResults()->text(), u"Resultados da pesquisa em Project2"_qs);
  window.form.txtSearch()->clear();
  window.form.cmdFind()->click();
  EXPECT_EQ(window.keys().size(), 5);
  EXPECT_FALSE(window.form.cmdCancel()->isEnabled());
}

TEST(FindWindow, StopDuringAllProjectsKeepsTheRowsFoundAndCountsThem) {
  Window window;
  QStringList many;
  for (int i = 0; i < 5000; ++i)
    many << u"%1 x = Total + Total ' Total"_qs.arg(i + 1);
  window.scene.ide.addModule(many);
  QObject::connect(&window.form.results(), &QAbstractItemModel::rowsInserted, [&] {
    if (window.form.results().rowCount() == 100) {
      EXPECT_TRUE(window.form.cmdCancel()->isEnabled());
      window.form.cmdCancel()->click();
    }
  });
  window.form.cmdFind()->click();
  EXPECT_EQ(window.form.results().rowCount(), 100);
  EXPECT_EQ(window.form.statusText(), u"Pesquisa completada ... 100 linhas localizadas"_qs);
  EXPECT_FALSE(window.form.cmdCancel()->isEnabled());
  EXPECT_TRUE(window.form.cmdFind()->isEnabled());
  EXPECT_FALSE(window.form.searching());
}

TEST(FindWindow, WithWildcardsTheGreyedMatchCaseBoxDoesNotFailTheSearch) {
  Window window;
  window.form.ckMatchCase()->setChecked(true);
  window.form.ckPattern()->click();
  EXPECT_FALSE(window.form.ckMatchCase()->isEnabled());
  window.form.txtSearch()->setText(u"TOTAL =*#"_qs);
  window.form.cmdFind()->click();
  EXPECT_TRUE(window.scene.boxes().isEmpty());
  EXPECT_EQ(window.form.results().rowCount(), 3);  // "Total = Valor * 1", "Total = 0", "total = TOTAL + 1"
  window.form.ckPattern()->click();
  EXPECT_TRUE(window.form.ckMatchCase()->isEnabled());
}

TEST(FindWindow, AnInvalidPatternSaysSoAndEndsTheSearch) {
  Window window;
  window.form.ckPattern()->setChecked(true);
  window.form.txtSearch()->setText(u"Total[0-9"_qs);
  window.form.cmdFind()->click();
  EXPECT_EQ(window.scene.boxes(),
            (QStringList{u"48 Erro na localização de texto.\n93 Invalid pattern string"_qs}));
  EXPECT_EQ(window.form.statusText(), u"Pesquisa completada ... 0 linhas localizadas"_qs);
  EXPECT_TRUE(window.form.cmdFind()->isEnabled());
}

TEST(FindWindow, CloseHidesItPutsBackTheResultsCaptionAndKeepsTheOptions) {
  Window window;
  window.form.OpSearch(2)->setChecked(true);
  window.form.ckWholeWd()->setChecked(true);
  window.form.cmdFind()->click();
  EXPECT_EQ(window.form.results().rowCount(), 3);
  window.form.cmdClose()->click();
  EXPECT_FALSE(window.form.isVisible());
  EXPECT_EQ(window.form.lblResults()->text(), u"Resultados:"_qs);
  EXPECT_TRUE(window.form.txtSearch()->text().isEmpty());
  EXPECT_EQ(window.form.results().rowCount(), 0);
  EXPECT_TRUE(window.form.statusText().isEmpty());
  window.form.Show(u"Valor"_qs);
  EXPECT_TRUE(window.form.OpSearch(2)->isChecked());
  EXPECT_TRUE(window.form.ckWholeWd()->isChecked());
  EXPECT_EQ(window.form.txtSearch()->text(), u"Valor"_qs);
  window.form.Show(u"duas\r\nlinhas"_qs);
  EXPECT_EQ(window.form.txtSearch()->text(), u"Valor"_qs);
}

TEST(FindWindow, ADoubleClickOpensTheOccurrenceAndMinimisesTheWindow) {
  Window window;
  window.form.cmdFind()->click();
  QTreeView* list = window.form.lvList();
  const QRect second = list->visualRect(list->model()->index(1, 3));
  ASSERT_TRUE(QTest::qWaitForWindowExposed(&window.form));
  // As a mouse does it: a click, then the second press that makes it a double-click.
  QTest::mouseClick(list->viewport(), Qt::LeftButton, {}, second.center());
  QTest::mouseDClick(list->viewport(), Qt::LeftButton, {}, second.center());
  auto pane = window.scene.ide.vbe->ActiveCodePane();
  ASSERT_TRUE(pane);
  EXPECT_EQ(pane->TopLine(), 6);  // line 6 with 40 visible lines: the line itself
  int sl = 0, sc = 0, el = 0, ec = 0;
  pane->GetSelection(sl, sc, el, ec);
  EXPECT_EQ((std::array{sl, sc, el, ec}), (std::array{6, 7, 6, 12}));
  EXPECT_TRUE(window.form.isMinimized());
}

// On the example group, as the add-in tells the window: a module removed takes only its own rows, a
// project removed while all projects are searched gives no rows after its own have gone.
TEST(FindWindow, RowsFollowTheModulesAndProjectsThatAreReallyOpen) {
  host::test::ExampleCopy copy;
  const auto vbe = host::VbeImpl::create();
  const auto projects = vbe->open(copy.groupFile());  // Loja, Utilitarios
  const auto twin = projects[1]->Add(ide::ComponentType::StdModule);
  twin->setName(u"modPrincipal"_qs);
  twin->CodeModule()->AddFromString(u"Dim x"_qs);
  frmFind form(vbe);
  form.txtSearch()->setText(u"Dim"_qs);
  form.cmdFind()->click();
  const auto rowsOf = [&](const QString& module) {
    return form.results()
        .match(form.results().index(0, 1), Qt::DisplayRole, module, -1, Qt::MatchExactly)
        .size();
  };
  ASSERT_GT(rowsOf(u"modPrincipal"_qs), 1);
  const auto main = projects[0]->VBComponents()->Item(u"modPrincipal"_qs);
  form.RemoveItemsOfComponent(main->Name(), projects[0]);
  projects[0]->Remove(main);
  EXPECT_EQ(rowsOf(u"modPrincipal"_qs), 1);

  QObject::connect(&form.results(), &QAbstractItemModel::rowsInserted, [&] {
    if (form.results().rowCount() == 1 && vbe->VBProjects()->Count() == 2)
      vbe->manualLoop()->post([&] {
        form.RemoveItemsOfProject(u"Loja"_qs);
        vbe->removeProject(projects[0]);
      });
  });
  form.cmdFind()->click();
  EXPECT_EQ(form.results().match(form.results().index(0, 0), Qt::DisplayRole, u"Loja"_qs, -1).size(), 0);
  EXPECT_EQ(rowsOf(u"modPrincipal"_qs), 1);
}

TEST(FindWindow, AWindowDestroyedWhileItsSearchYieldsEndsTheSearch) {
  Scene scene;
  QPointer<frmFind> form = new frmFind(scene.ide.vbe);
  form->txtSearch()->setText(u"Total"_qs);
  QObject::connect(&form->results(), &QAbstractItemModel::rowsInserted, [&] {
    scene.loop().post([&] { delete form.data(); });  // the add-in shuts down from the IDE's loop
  });
  int rows = 0;
  QObject::connect(&form->results(), &QAbstractItemModel::rowsInserted, [&] { ++rows; });
  form->cmdFind()->click();
  EXPECT_TRUE(form.isNull());
  EXPECT_EQ(rows, 1);
}

}  // namespace
}  // namespace find
