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
    QStringLiteral("Option Explicit"),
    QStringLiteral("Private Const MARCA As String = \"aaaa\""),  // 2: three "aa" in the declarations
    QString(),
    QStringLiteral("Public Function Total(ByVal Valor As Currency) As Currency"),
    QStringLiteral("10    On Error GoTo Erro"),
    QStringLiteral("20    Total = Valor * 1.1 ' acréscimo"),
    QStringLiteral("      Exit Function"),
    QStringLiteral("Erro:"),
    QStringLiteral("\t30  Total = 0   "),  // 9
    QStringLiteral("End Function"),
};
const QStringList kDatas = {QStringLiteral("Sub Somar()"), QStringLiteral("  total = TOTAL + 1"),
                            QStringLiteral("End Sub")};

struct Scene {
  transform::test::Ide ide;  // Project1, the active one
  ide::Ref<ide::CodeModule> pedidos = ide.addModule(kPedidos);
  std::shared_ptr<host::ProjectImpl> other = ide.vbe->newProject();
  ide::Ref<ide::CodeModule> datas = other->Add(ide::ComponentType::StdModule)->CodeModule();

  Scene() {
    datas->AddFromString(kDatas.join(QStringLiteral("\r\n")));
    ide.vbe->setActiveVBProject(ide.project);
    ide.vbe->selectComponent(std::dynamic_pointer_cast<host::ComponentImpl>(pedidos->Parent()));
  }
  host::HeadlessUi& ui() { return *ide.vbe->headlessUi(); }
  host::ManualEventLoop& loop() { return *ide.vbe->manualLoop(); }
  QStringList boxes() {
    QStringList shown;
    for (const auto& box : ui().messageBoxes())
      shown << QStringLiteral("%1 %2").arg(box.style).arg(box.prompt);
    return shown;
  }
};

/// A row as one text: project | module | procedure | start line:column-end column | text.
QString rowText(const FoundRow& row) {
  return QStringLiteral("%1|%2|%3|%4:%5-%6|%7")
      .arg(row.project, row.module, row.procedure)
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
  transform::WalkContext context(QStringLiteral("test"), &scene.loop(), nullptr);
  FindWalk(context, *scene.ide.vbe, recorder).Search(scope, options);
  if (labels) *labels = recorder.labels;
  return recorder.rows;
}

TEST(FindWalk, ListsOverlappingOccurrencesWithTheirProcedureAndTrimmedLine) {
  Scene scene;
  QStringList labels;
  EXPECT_EQ(search(scene, SearchScope::AllProjects, {QStringLiteral("aa")}, &labels),
            (QStringList{QStringLiteral("Project1|Module1|(Declarations)|2:34-36|") + kPedidos[1],
                         QStringLiteral("Project1|Module1|(Declarations)|2:35-37|") + kPedidos[1],
                         QStringLiteral("Project1|Module1|(Declarations)|2:36-38|") + kPedidos[1]}));
  EXPECT_EQ(labels, (QStringList{QStringLiteral("Resultados da pesquisa em Project1"),
                                 QStringLiteral("Resultados da pesquisa em Project2")}));
  EXPECT_EQ(
      search(scene, SearchScope::AllProjects, {QStringLiteral("total = "), false, false, false}),
      (QStringList{QStringLiteral("Project1|Module1|Total|6:7-15|20    Total = Valor * 1.1 ' acréscimo"),
                   QStringLiteral("Project1|Module1|Total|9:6-14|30  Total = 0"),
                   QStringLiteral("Project2|Module1|Somar|2:3-11|total = TOTAL + 1")}));
}

TEST(FindWalk, SearchesTheScopeTheOptionButtonsChoose) {
  Scene scene;
  const FindOptions total{QStringLiteral("Total"), true, true, false};
  EXPECT_EQ(search(scene, SearchScope::ActiveProject, total).size(), 3);
  EXPECT_EQ(search(scene, SearchScope::ActiveModule, total).size(), 3);
  scene.ide.vbe->setActiveVBProject(scene.other);
  scene.ide.vbe->selectComponent(std::dynamic_pointer_cast<host::ComponentImpl>(scene.datas->Parent()));
  EXPECT_TRUE(search(scene, SearchScope::ActiveProject, total).isEmpty());  // "TOTAL", "total"
  EXPECT_EQ(search(scene, SearchScope::ActiveModule, {QStringLiteral("total"), true}).size(), 2);
  scene.ide.vbe->selectComponent(nullptr);
  EXPECT_TRUE(search(scene, SearchScope::ActiveModule, total).isEmpty());
}

TEST(FindResults, RemovalTakesTheRowsOfAModuleOrProjectAndKeepsTheOtherKeys) {
  Scene scene;
  FindResults results;
  for (const char* project : {"Loja", "Dados", "Loja"})
    for (const char* module : {"modA", "modB", "modA"})
      results.add({QString::fromLatin1(project), QString::fromLatin1(module), {}, {}, {}});
  EXPECT_EQ(results.RemoveItemsOfComponent(QStringLiteral("modA")), 6);
  EXPECT_EQ(results.rowCount(), 3);
  EXPECT_EQ(results.keyOf(0), QStringLiteral("_2"));
  EXPECT_EQ(results.keyOf(2), QStringLiteral("_8"));
  EXPECT_EQ(results.item(QStringLiteral("_1")), nullptr);
  EXPECT_NE(results.item(QStringLiteral("_5")), nullptr);
  EXPECT_EQ(results.RemoveItemsOfProject(QStringLiteral("Loja")), 2);
  EXPECT_EQ(results.keyOf(0), QStringLiteral("_5"));
  results.clear();
  EXPECT_EQ(results.add({}), QStringLiteral("_1"));
  EXPECT_EQ(results.headerData(3, Qt::Horizontal).toString(), QStringLiteral("Texto Localizado"));
}

TEST(Navigation, ShowsTheOccurrenceWithHalfAPaneAboveItOrAtTheTop) {
  EXPECT_EQ(TopLineFor(3, 40), 3);
  EXPECT_EQ(TopLineFor(21, 40), 1);
  EXPECT_EQ(TopLineFor(100, 41), 80);
  Scene scene;
  for (int i = 0; i < 200; ++i)
    scene.pedidos->InsertLines(1, QStringLiteral("' linha"));
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
      (QStringList{QStringLiteral("64 O item seleciondado pertence a um projeto não localizado."),
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
    form.txtSearch()->setText(QStringLiteral("Total"));
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
  EXPECT_EQ(window.form.windowTitle(), QStringLiteral("Quimbel - Localizar Estendido"));
  window.form.cmdFind()->click();
  EXPECT_EQ(window.keys(), (QStringList{QStringLiteral("_1"), QStringLiteral("_2"), QStringLiteral("_3"),
                                        QStringLiteral("_4"), QStringLiteral("_5")}));
  EXPECT_EQ(window.form.statusText(), QStringLiteral("Pesquisa completada ... 5 linhas localizadas"));
  EXPECT_EQ(window.form.lblResults()->text(), QStringLiteral("Resultados da pesquisa em Project2"));
  window.form.txtSearch()->clear();
  window.form.cmdFind()->click();
  EXPECT_EQ(window.keys().size(), 5);
  EXPECT_FALSE(window.form.cmdCancel()->isEnabled());
}

TEST(FindWindow, StopDuringAllProjectsKeepsTheRowsFoundAndCountsThem) {
  Window window;
  QStringList many;
  for (int i = 0; i < 5000; ++i)
    many << QStringLiteral("%1 x = Total + Total ' Total").arg(i + 1);
  window.scene.ide.addModule(many);
  QObject::connect(&window.form.results(), &QAbstractItemModel::rowsInserted, [&] {
    if (window.form.results().rowCount() == 100) {
      EXPECT_TRUE(window.form.cmdCancel()->isEnabled());
      window.form.cmdCancel()->click();
    }
  });
  window.form.cmdFind()->click();
  EXPECT_EQ(window.form.results().rowCount(), 100);
  EXPECT_EQ(window.form.statusText(), QStringLiteral("Pesquisa completada ... 100 linhas localizadas"));
  EXPECT_FALSE(window.form.cmdCancel()->isEnabled());
  EXPECT_TRUE(window.form.cmdFind()->isEnabled());
  EXPECT_FALSE(window.form.searching());
}

TEST(FindWindow, WithWildcardsTheGreyedMatchCaseBoxDoesNotFailTheSearch) {
  Window window;
  window.form.ckMatchCase()->setChecked(true);
  window.form.ckPattern()->click();
  EXPECT_FALSE(window.form.ckMatchCase()->isEnabled());
  window.form.txtSearch()->setText(QStringLiteral("TOTAL =*#"));
  window.form.cmdFind()->click();
  EXPECT_TRUE(window.scene.boxes().isEmpty());
  EXPECT_EQ(window.form.results().rowCount(), 3);  // "Total = Valor * 1", "Total = 0", "total = TOTAL + 1"
  window.form.ckPattern()->click();
  EXPECT_TRUE(window.form.ckMatchCase()->isEnabled());
}

TEST(FindWindow, AnInvalidPatternSaysSoAndEndsTheSearch) {
  Window window;
  window.form.ckPattern()->setChecked(true);
  window.form.txtSearch()->setText(QStringLiteral("Total[0-9"));
  window.form.cmdFind()->click();
  EXPECT_EQ(window.scene.boxes(),
            (QStringList{QStringLiteral("48 Erro na localização de texto.\n93 Invalid pattern string")}));
  EXPECT_EQ(window.form.statusText(), QStringLiteral("Pesquisa completada ... 0 linhas localizadas"));
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
  EXPECT_EQ(window.form.lblResults()->text(), QStringLiteral("Resultados:"));
  EXPECT_TRUE(window.form.txtSearch()->text().isEmpty());
  EXPECT_EQ(window.form.results().rowCount(), 0);
  EXPECT_TRUE(window.form.statusText().isEmpty());
  window.form.Show(QStringLiteral("Valor"));
  EXPECT_TRUE(window.form.OpSearch(2)->isChecked());
  EXPECT_TRUE(window.form.ckWholeWd()->isChecked());
  EXPECT_EQ(window.form.txtSearch()->text(), QStringLiteral("Valor"));
  window.form.Show(QStringLiteral("duas\r\nlinhas"));
  EXPECT_EQ(window.form.txtSearch()->text(), QStringLiteral("Valor"));
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

TEST(FindWindow, AWindowDestroyedWhileItsSearchYieldsEndsTheSearch) {
  Scene scene;
  QPointer<frmFind> form = new frmFind(scene.ide.vbe);
  form->txtSearch()->setText(QStringLiteral("Total"));
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
