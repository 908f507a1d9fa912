// SPDX-License-Identifier: MIT
// The numbering and indentation dialogs on the offscreen platform over a headless IDE: captions,
// settings, the numbers-only boxes, validation, runs by both routes, the wait before closing, cancelling
// and the failure messages.
#include "transform/dialogs.h"
#include "common/settings.h"
#include "common/strings.h"
#include "host/platform/headlessui.h"
#include "host/platform/manualloop.h"
#include "modelfixture.h"
#include "testproject.h"
#include "transform/frmindenter.h"
#include "transform/frmlinnumbers.h"

#include "printers.h"

#include <gtest/gtest.h>

#include <QApplication>
#include <QClipboard>
#include <QGroupBox>
#include <QLabel>
#include <QProgressBar>
#include <QPushButton>
#include <QRadioButton>
#include <QTemporaryDir>
#include <QTest>
#include <QTimer>

namespace transform {
namespace {

using test::Ide;
using test::kFirst;
using test::kSecond;
using test::linesOf;

struct Box {
  QString prompt;
  int style = 0;
  friend bool operator==(const Box&, const Box&) = default;
  friend void PrintTo(const Box& box, std::ostream* os) {
    *os << box.style << " ";
    PrintTo(box.prompt, os);
  }
};

// A headless IDE with two modules, the caret in the first one's procedure, and settings of its own.
struct Scene : test::TwoModules {
  QTemporaryDir dir;
  common::SettingsStore settings{dir.filePath(u"Quimbel.ini"_qs)};
  common::Options options;

  explicit Scene(bool oneCommand = false) {
    options.OneCommandNumIndent = oneCommand;
    Ide::placeCaret(first, 4);
  }
  host::HeadlessUi& ui() { return *ide.vbe->headlessUi(); }
  host::ManualEventLoop& loop() { return *ide.vbe->manualLoop(); }
  std::vector<Box> boxes() {
    std::vector<Box> shown;
    for (const auto& box : ui().messageBoxes()) {
      EXPECT_EQ(box.title, u"Quimbel"_qs);
      shown.push_back({box.prompt, box.style});
    }
    return shown;
  }
};

QString text(int id) {
  return common::LoadResString(id);
}

void showActive(QWidget& widget) {
  widget.show();
  QApplication::setActiveWindow(&widget);
  ASSERT_TRUE(QTest::qWaitForWindowActive(&widget));
}

// A project whose second component is a related document, selected.
struct RelatedDocumentScene {
  QTemporaryDir dir;
  common::SettingsStore settings{dir.filePath(u"Quimbel.ini"_qs)};
  common::Options options;
  std::shared_ptr<host::VbeImpl> vbe = host::VbeImpl::create();
  std::shared_ptr<host::ProjectImpl> project = test::openWithRelatedDocument(*vbe, dir.path());

  RelatedDocumentScene() {
    vbe->setActiveVBProject(project);
    vbe->selectComponent(project->components()[1]);
    options.OneCommandNumIndent = false;
  }
  QString code() { return project->components()[0]->CodeModule()->Lines(2, 1); }
};

// ---------------------------------------------------------------------------------------------------
// The numbering dialog

TEST(LineNumberingDialog, OpensWithItsCaptionsTheStoredNumbersAndTheProcedureScope) {
  Scene scene;
  frmLinNumbers dialog(scene.ide.vbe, scene.settings, scene.options);
  EXPECT_EQ(dialog.windowTitle(), u"Quimbel - Numerar Linhas"_qs);
  EXPECT_EQ(dialog.cmdAdd()->text(), u"&Adicionar"_qs);
  EXPECT_EQ(dialog.cmdRemove()->text(), u"&Remover"_qs);
  EXPECT_EQ(dialog.cmdCancel()->text(), u"&Fechar"_qs);
  EXPECT_EQ(dialog.frOptions()->title(), u"A&dicionar ou remover números de linha para:"_qs);
  EXPECT_EQ(dialog.lblStartNum()->text(), u"&Número Inicial:"_qs);
  EXPECT_EQ(dialog.lblInterval()->text(), u"Inter&valo:"_qs);
  EXPECT_EQ(dialog.opNumbers(0)->text(), u"&Projeto"_qs);
  EXPECT_EQ(dialog.opNumbers(1)->text(), u"&Módulo"_qs);
  EXPECT_EQ(dialog.opNumbers(2)->text(), u"Pr&ocedimento"_qs);
  EXPECT_TRUE(dialog.opNumbers(2)->isChecked());
  EXPECT_EQ(dialog.txtInitial()->text(), u"10000"_qs);
  EXPECT_EQ(dialog.txtInterval()->text(), u"5"_qs);
  EXPECT_EQ(dialog.startNumber(), 10000);
  EXPECT_EQ(dialog.interval(), 5);
  EXPECT_TRUE(dialog.ProgBar()->isHidden());

  scene.settings.setValue(common::setting::InitialNumber, u" 200 "_qs);
  scene.settings.setValue(common::setting::Interval, u"dez"_qs);
  frmLinNumbers stored(scene.ide.vbe, scene.settings, scene.options);
  EXPECT_EQ(stored.txtInitial()->text(), u"200"_qs);
  EXPECT_EQ(stored.startNumber(), 200);
  EXPECT_EQ(stored.txtInterval()->text(), u"5"_qs);  // not a number: the default
}

TEST(LineNumberingDialog, TheBoxesTakeDigitsOnly) {
  Scene scene;
  frmLinNumbers dialog(scene.ide.vbe, scene.settings, scene.options);
  showActive(dialog);
  QLineEdit* box = dialog.txtInitial();
  box->clear();
  box->setFocus();
  QTest::keyClicks(box, u"12ab-3"_qs);
  EXPECT_EQ(box->text(), u"123"_qs);

  QApplication::clipboard()->setText(u"45"_qs);
  if (QApplication::clipboard()->text() != u"45"_qs) GTEST_SKIP() << "no clipboard here";
  QTest::keyClick(box, Qt::Key_V, Qt::ControlModifier);
  QTest::keyClick(box, Qt::Key_Insert, Qt::ShiftModifier);
  EXPECT_EQ(box->text(), u"123"_qs);
  EXPECT_EQ(box->contextMenuPolicy(), Qt::NoContextMenu);
  EXPECT_FALSE(box->acceptDrops());

  // The same keys paste into an ordinary box, so they did reach ours.
  QLineEdit plain;
  showActive(plain);
  plain.setFocus();
  QTest::keyClick(&plain, Qt::Key_V, Qt::ControlModifier);
  EXPECT_EQ(plain.text(), u"45"_qs);
}

TEST(LineNumberingDialog, ABoxSelectsItsWholeTextWhenItGetsTheFocus) {
  Scene scene;
  frmLinNumbers dialog(scene.ide.vbe, scene.settings, scene.options);
  showActive(dialog);
  dialog.txtInitial()->setFocus(Qt::OtherFocusReason);
  EXPECT_EQ(dialog.txtInitial()->selectedText(), u"10000"_qs);
  QTest::mouseClick(dialog.txtInterval(), Qt::LeftButton);
  QCoreApplication::processEvents();
  EXPECT_TRUE(dialog.txtInterval()->hasFocus());
  EXPECT_EQ(dialog.txtInterval()->selectedText(), u"5"_qs);
}

TEST(LineNumberingDialog, ANonNumericBoxIsRefusedWithItsMessageAndGetsTheFocus) {
  Scene scene;
  frmLinNumbers dialog(scene.ide.vbe, scene.settings, scene.options);
  showActive(dialog);
  dialog.txtInitial()->setText(u"12a"_qs);
  dialog.cmdAdd()->click();
  EXPECT_EQ(scene.boxes(), (std::vector<Box>{{text(5119), ide::mb::Exclamation}}));
  EXPECT_EQ(QApplication::focusWidget(), dialog.txtInitial());

  scene.ui().clearMessageBoxes();
  dialog.txtInitial()->clear();  // an empty box keeps the value last used
  dialog.txtInterval()->setText(u"x"_qs);
  dialog.cmdRemove()->click();
  EXPECT_EQ(scene.boxes(), (std::vector<Box>{{text(5120), ide::mb::Exclamation}}));
  EXPECT_EQ(QApplication::focusWidget(), dialog.txtInterval());

  EXPECT_EQ(linesOf(*scene.first), kFirst);
  EXPECT_TRUE(dialog.isVisible());
  EXPECT_TRUE(dialog.cmdAdd()->isEnabled());
}

TEST(LineNumberingDialog, NumbersTheCurrentProcedureThenClosesASecondLater) {
  Scene scene;
  frmLinNumbers dialog(scene.ide.vbe, scene.settings, scene.options);
  showActive(dialog);
  dialog.txtInitial()->setText(u"100"_qs);
  dialog.txtInterval()->setText(u"10"_qs);
  dialog.cmdAdd()->click();
  EXPECT_EQ(linesOf(*scene.first), (QStringList{kFirst[0], kFirst[1], u"100 If x Then"_qs, u"110 y = 1"_qs,
                                                u"120 End If"_qs, kFirst[5]}));
  EXPECT_EQ(linesOf(*scene.second), kSecond);

  // The finished run shows its full bar while the IDE's loop goes on.
  EXPECT_TRUE(dialog.isVisible());
  EXPECT_FALSE(dialog.ProgBar()->isHidden());
  EXPECT_EQ(dialog.ProgBar()->value(), dialog.ProgBar()->maximum());
  EXPECT_FALSE(dialog.cmdAdd()->isEnabled());
  EXPECT_FALSE(dialog.cmdRemove()->isEnabled());
  EXPECT_EQ(dialog.cmdCancel()->text(), u"&Cancelar"_qs);
  EXPECT_EQ(scene.ui().cursor(), ide::Cursor::ArrowHourglass);
  scene.loop().advance(999);
  EXPECT_TRUE(dialog.isVisible());
  scene.loop().advance(1);
  EXPECT_FALSE(dialog.isVisible());
  EXPECT_TRUE(dialog.ProgBar()->isHidden());
  EXPECT_TRUE(dialog.cmdAdd()->isEnabled());
  EXPECT_EQ(dialog.cmdCancel()->text(), u"&Fechar"_qs);
  EXPECT_EQ(scene.ui().cursor(), ide::Cursor::Default);
  EXPECT_TRUE(scene.boxes().empty());
}

TEST(LineNumberingDialog, RemovesTheNumbersOfTheSelectedModuleOrTheProject) {
  Scene scene;
  auto numbered = scene.ide.addModule({u"Sub Tres()"_qs, u"10 a = 1"_qs, u"End Sub"_qs});
  scene.select(numbered);
  {
    frmLinNumbers dialog(scene.ide.vbe, scene.settings, scene.options);
    dialog.opNumbers(1)->setChecked(true);
    dialog.cmdRemove()->click();
    scene.loop().advance(1000);
  }
  EXPECT_EQ(linesOf(*numbered)[1], u"a = 1"_qs);
  EXPECT_EQ(linesOf(*scene.first), kFirst);

  frmLinNumbers dialog(scene.ide.vbe, scene.settings, scene.options);
  dialog.opNumbers(0)->setChecked(true);
  dialog.cmdAdd()->click();
  EXPECT_EQ(linesOf(*scene.first)[2], u"10000 If x Then"_qs);
  EXPECT_EQ(linesOf(*scene.second)[1], u"10000 z = 2"_qs);
  EXPECT_EQ(linesOf(*numbered)[1], u"10000 a = 1"_qs);
}

TEST(LineNumberingDialog, WithTheOneCommandOptionNumbersAndIndentsWithTabs) {
  Scene scene(true);
  frmLinNumbers dialog(scene.ide.vbe, scene.settings, scene.options);
  dialog.txtInitial()->setText(u"100"_qs);
  dialog.txtInterval()->setText(u"10"_qs);
  dialog.cmdAdd()->click();
  EXPECT_EQ(linesOf(*scene.first), (QStringList{kFirst[0], kFirst[1], u"100 \tIf x Then"_qs,
                                                u"110 \t\ty = 1"_qs, u"120 \tEnd If"_qs, kFirst[5]}));

  // Removing re-indents too; the number column is empty then.
  frmLinNumbers again(scene.ide.vbe, scene.settings, scene.options);
  again.cmdRemove()->click();
  EXPECT_EQ(linesOf(*scene.first), (QStringList{kFirst[0], kFirst[1], u"\tIf x Then"_qs, u"\t\ty = 1"_qs,
                                                u"\tEnd If"_qs, kFirst[5]}));
}

TEST(LineNumberingDialog, AFailureOfTheOneCommandRouteShowsTheWalksMessageAndEndsTheRun) {
  Scene scene(true);
  scene.first->CodePane()->Window()->Close();  // no code window: no current procedure
  frmLinNumbers dialog(scene.ide.vbe, scene.settings, scene.options);
  dialog.show();
  dialog.cmdAdd()->click();
  EXPECT_EQ(scene.boxes(), (std::vector<Box>{{text(5123) + u" (erro 91)"_qs, ide::mb::Exclamation}}));
  EXPECT_TRUE(dialog.cancelled());
  EXPECT_FALSE(dialog.isVisible());  // a cancelled run closes at once
}

TEST(LineNumberingDialog, AWalkFailureShowsTheMessageOfTheScopeWithItsModuleAndLine) {
  Scene scene;
  frmLinNumbers dialog(scene.ide.vbe, scene.settings, scene.options);
  dialog.txtInitial()->setText(u"2147483647"_qs);
  dialog.cmdAdd()->click();
  EXPECT_EQ(scene.boxes(),
            (std::vector<Box>{{text(5123) + u"\n\nMódulo %1, linha 4. (erro 6)"_qs.arg(scene.first->Name()),
                               ide::mb::Exclamation}}));
}

TEST(LineNumberingDialog, ARelatedDocumentAsTheModuleChangesNothingAndLeavesTheDialogIdle) {
  RelatedDocumentScene scene;
  frmLinNumbers dialog(scene.vbe, scene.settings, scene.options);
  dialog.show();
  dialog.opNumbers(1)->setChecked(true);
  dialog.cmdAdd()->click();
  EXPECT_TRUE(scene.vbe->headlessUi()->messageBoxes().empty());
  EXPECT_EQ(scene.code(), u"x = 1"_qs);
  EXPECT_TRUE(dialog.isVisible());
  EXPECT_TRUE(dialog.cmdAdd()->isEnabled());
  EXPECT_TRUE(dialog.ProgBar()->isHidden());
  EXPECT_EQ(dialog.cmdCancel()->text(), u"&Fechar"_qs);
}

TEST(LineNumberingDialog, CancelDuringARunEndsTheWalkAndClosesTheDialogAtOnce) {
  Scene scene;
  frmLinNumbers dialog(scene.ide.vbe, scene.settings, scene.options);
  dialog.show();
  dialog.opNumbers(0)->setChecked(true);
  // The user clicks Cancel when the bar first moves: the first module's only member is done.
  QObject::connect(dialog.ProgBar(), &QProgressBar::valueChanged, &dialog, [&](int value) {
    if (value == 1) dialog.cmdCancel()->click();
  });
  dialog.cmdAdd()->click();
  EXPECT_EQ(linesOf(*scene.first)[2], u"10000 If x Then"_qs);
  EXPECT_EQ(linesOf(*scene.second), kSecond);
  EXPECT_FALSE(dialog.isVisible());
  EXPECT_TRUE(dialog.ProgBar()->isHidden());
  EXPECT_FALSE(scene.loop().activeTimers());
}

TEST(LineNumberingDialog, ACancelOrACloseAsTheRunStartsStopsEitherRoute) {
  for (const bool oneCommand : {true, false}) {
    Scene scene(oneCommand);
    frmLinNumbers dialog(scene.ide.vbe, scene.settings, scene.options);
    dialog.show();
    dialog.opNumbers(0)->setChecked(true);
    // Runs in the run's first yield, before the walk.
    scene.loop().post([&] { oneCommand ? dialog.cmdCancel()->click() : (void)dialog.close(); });
    dialog.cmdAdd()->click();
    EXPECT_EQ(linesOf(*scene.first), kFirst);
    EXPECT_EQ(linesOf(*scene.second), kSecond);
    EXPECT_FALSE(dialog.isVisible());
  }
}

TEST(LineNumberingDialog, RemembersTheNumbersItClosesWith) {
  Scene scene;
  {
    frmLinNumbers dialog(scene.ide.vbe, scene.settings, scene.options);
    dialog.show();
    dialog.txtInitial()->setText(u"500"_qs);
    dialog.txtInterval()->setText(u"50"_qs);
    dialog.close();
  }
  EXPECT_EQ(scene.settings.value(common::setting::InitialNumber), u"500"_qs);
  EXPECT_EQ(scene.settings.value(common::setting::Interval), u"50"_qs);
  {
    frmLinNumbers dialog(scene.ide.vbe, scene.settings, scene.options);
    dialog.show();
    dialog.txtInitial()->clear();
    dialog.txtInterval()->setText(u"x"_qs);
    dialog.close();
  }
  EXPECT_EQ(scene.settings.value(common::setting::InitialNumber), u"500"_qs);
  EXPECT_EQ(scene.settings.value(common::setting::Interval), u"50"_qs);
  {
    // The values a run used are kept too.
    frmLinNumbers dialog(scene.ide.vbe, scene.settings, scene.options);
    dialog.show();
    dialog.txtInitial()->setText(u"700"_qs);
    dialog.cmdAdd()->click();
    scene.loop().advance(1000);
    EXPECT_FALSE(dialog.isVisible());
  }
  EXPECT_EQ(scene.settings.value(common::setting::InitialNumber), u"700"_qs);
}

// ---------------------------------------------------------------------------------------------------
// The indentation dialog

TEST(IndentationDialog, OpensWithItsCaptionsAndTheStoredUnit) {
  Scene scene;
  frmIndenter dialog(scene.ide.vbe, scene.settings, scene.options);
  EXPECT_EQ(dialog.windowTitle(), u"Quimbel - Indentar Código"_qs);
  EXPECT_EQ(dialog.cmdCancel()->text(), u"&Fechar"_qs);
  EXPECT_EQ(dialog.cmdIndent()->text(), u"&Indentar"_qs);
  EXPECT_EQ(dialog.frIndent()->title(), u"In&dentar"_qs);
  EXPECT_EQ(dialog.frUse()->title(), u"&Usar"_qs);
  EXPECT_EQ(dialog.opIndent(0)->text(), u"&Projeto"_qs);
  EXPECT_EQ(dialog.opIndent(1)->text(), u"&Módulo"_qs);
  EXPECT_EQ(dialog.opIndent(2)->text(), u"Pr&ocedimento"_qs);
  EXPECT_EQ(dialog.opSpaces(0)->text(), u"&Tabs"_qs);
  EXPECT_EQ(dialog.opSpaces(1)->text(), u"E&spaços"_qs);
  EXPECT_TRUE(dialog.opIndent(2)->isChecked());
  EXPECT_TRUE(dialog.opSpaces(0)->isChecked());
  EXPECT_EQ(dialog.txtSpaces()->text(), u"3"_qs);
  EXPECT_EQ(dialog.txtSpaces()->contextMenuPolicy(), Qt::NoContextMenu);

  for (const auto& [use, spaces] : {std::pair{"1", true}, std::pair{"", false}, std::pair{"0", false}}) {
    scene.settings.setValue(common::setting::UseOption, QString::fromLatin1(use));
    frmIndenter stored(scene.ide.vbe, scene.settings, scene.options);
    EXPECT_EQ(stored.spaceMode(), spaces) << use;
    EXPECT_EQ(stored.opSpaces(1)->isChecked(), spaces) << use;
  }
}

TEST(IndentationDialog, ChoosingSpacesMovesTheFocusIntoTheSpacesBox) {
  Scene scene;
  frmIndenter dialog(scene.ide.vbe, scene.settings, scene.options);
  showActive(dialog);
  dialog.opIndent(0)->setFocus();
  QTest::mouseClick(dialog.opSpaces(1), Qt::LeftButton);
  EXPECT_TRUE(dialog.spaceMode());
  EXPECT_EQ(QApplication::focusWidget(), dialog.txtSpaces());
}

TEST(IndentationDialog, AMissingOrInvalidSpaceCountIsRefused) {
  Scene scene;
  frmIndenter dialog(scene.ide.vbe, scene.settings, scene.options);
  showActive(dialog);
  dialog.opSpaces(1)->setChecked(true);
  const std::pair<const char*, int> cases[] = {{" ", 5125}, {"0", 5124}, {"x", 5124}, {"99999999999", 5124}};
  for (const auto& [spaces, message] : cases) {
    scene.ui().clearMessageBoxes();
    dialog.opIndent(0)->setFocus();
    dialog.txtSpaces()->setText(QString::fromLatin1(spaces));
    dialog.cmdIndent()->click();
    EXPECT_EQ(scene.boxes(), (std::vector<Box>{{text(message), ide::mb::Information}})) << spaces;
    EXPECT_EQ(QApplication::focusWidget(), dialog.txtSpaces());
  }
  EXPECT_EQ(linesOf(*scene.first), kFirst);
  EXPECT_TRUE(dialog.isVisible());
  // Tabs need no count.
  dialog.opSpaces(0)->setChecked(true);
  dialog.cmdIndent()->click();
  EXPECT_EQ(linesOf(*scene.first)[3], u"\t\ty = 1"_qs);
}

TEST(IndentationDialog, IndentsTheSelectedModuleWithSpacesClosesAndRemembersTheUnit) {
  Scene scene;
  scene.select(scene.second);
  frmIndenter dialog(scene.ide.vbe, scene.settings, scene.options);
  dialog.show();
  dialog.opIndent(1)->setChecked(true);
  dialog.opSpaces(1)->setChecked(true);
  dialog.txtSpaces()->setText(u"2"_qs);
  dialog.cmdIndent()->click();
  EXPECT_EQ(linesOf(*scene.second), (QStringList{kSecond[0], u"  z = 2"_qs, kSecond[2]}));
  EXPECT_EQ(linesOf(*scene.first), kFirst);
  EXPECT_FALSE(dialog.isVisible());
  EXPECT_EQ(scene.settings.value(common::setting::UseOption), u"1"_qs);
  EXPECT_EQ(scene.settings.value(common::setting::Indentation), u"2"_qs);
  EXPECT_TRUE(scene.boxes().empty());
}

TEST(IndentationDialog, ClosingWithTabsRemembersTabsAndLeavesTheUnit) {
  Scene scene;
  scene.settings.setValue(common::setting::Indentation, u"4"_qs);
  scene.settings.setValue(common::setting::UseOption, u"1"_qs);
  frmIndenter dialog(scene.ide.vbe, scene.settings, scene.options);
  dialog.show();
  dialog.opSpaces(0)->setChecked(true);
  dialog.txtSpaces()->setText(u"8"_qs);
  dialog.cmdCancel()->click();
  EXPECT_FALSE(dialog.isVisible());
  EXPECT_EQ(scene.settings.value(common::setting::UseOption), u"0"_qs);
  EXPECT_EQ(scene.settings.value(common::setting::Indentation), u"4"_qs);
}

TEST(IndentationDialog, WithTheOneCommandOptionNumbersFrom10000InStepsOf5) {
  Scene scene(true);
  scene.settings.setValue(common::setting::InitialNumber, u"1"_qs);  // not the numbering's
  frmIndenter dialog(scene.ide.vbe, scene.settings, scene.options);
  dialog.opSpaces(1)->setChecked(true);
  dialog.txtSpaces()->setText(u"3"_qs);
  dialog.cmdIndent()->click();
  EXPECT_EQ(linesOf(*scene.first), (QStringList{kFirst[0], kFirst[1], u"10000    If x Then"_qs,
                                                u"10005       y = 1"_qs, u"10010    End If"_qs, kFirst[5]}));
}

TEST(IndentationDialog, CancelDuringARunEndsTheWalkAndTheDialog) {
  Scene scene;
  frmIndenter dialog(scene.ide.vbe, scene.settings, scene.options);
  dialog.show();
  dialog.opIndent(0)->setChecked(true);
  QString caption;
  QObject::connect(dialog.ProgBar(), &QProgressBar::valueChanged, &dialog, [&](int value) {
    if (value == 0 || !caption.isEmpty()) return;
    dialog.cmdCancel()->click();
    caption = dialog.cmdCancel()->text();
  });
  dialog.cmdIndent()->click();
  EXPECT_EQ(caption, u"&Fechar"_qs);
  EXPECT_EQ(linesOf(*scene.first)[2], u"\tIf x Then"_qs);
  EXPECT_EQ(linesOf(*scene.second), kSecond);
  EXPECT_FALSE(dialog.isVisible());
}

TEST(IndentationDialog, AFailedRunShowsItsMessageAndStaysOpen) {
  Scene scene;
  scene.ide.vbe->selectComponent(nullptr);
  frmIndenter dialog(scene.ide.vbe, scene.settings, scene.options);
  dialog.show();
  dialog.opIndent(1)->setChecked(true);
  dialog.cmdIndent()->click();
  EXPECT_EQ(scene.boxes(), (std::vector<Box>{{text(5126), ide::mb::Information}}));
  EXPECT_TRUE(dialog.isVisible());
  EXPECT_TRUE(dialog.cmdIndent()->isEnabled());
  EXPECT_EQ(dialog.cmdCancel()->text(), u"&Fechar"_qs);
}

TEST(IndentationDialog, AModuleWalkFailureShowsTheModuleMessage) {
  RelatedDocumentScene scene;
  frmIndenter dialog(scene.vbe, scene.settings, scene.options);
  dialog.opIndent(1)->setChecked(true);
  dialog.cmdIndent()->click();
  ASSERT_EQ(scene.vbe->headlessUi()->messageBoxes().size(), 1u);
  EXPECT_TRUE(scene.vbe->headlessUi()->messageBoxes()[0].prompt.startsWith(text(5129)));
  EXPECT_EQ(scene.vbe->headlessUi()->messageBoxes()[0].style, ide::mb::Exclamation);
}

TEST(IndentationDialog, ALineTheOneCommandRouteWouldGrowTooLongIsNamedInTheWalksMessage) {
  Scene scene(true);
  // 1023 characters: any indentation pushes it past the IDE's limit, and its numbering fails silently.
  auto module = scene.ide.addModule({u"Sub Longa()"_qs, u"If x Then"_qs,
                                     u"y = \""_qs + QString(1017, u'a') + u'"', u"End If"_qs, u"End Sub"_qs});
  scene.select(module);
  frmIndenter dialog(scene.ide.vbe, scene.settings, scene.options);
  dialog.opIndent(1)->setChecked(true);
  dialog.cmdIndent()->click();
  EXPECT_EQ(
      scene.boxes(),
      (std::vector<Box>{{text(5129) + u"\n\nMódulo %1, linha 3. A linha passaria de 1023 caracteres."_qs.arg(
                                          module->Name()),
                         ide::mb::Exclamation}}));
  EXPECT_EQ(linesOf(*module)[2].size(), 1023);
}

// ---------------------------------------------------------------------------------------------------
// How the add-in opens them

TEST(OpeningTheDialogs, EachOpensModallyAndReturnsWhenClosed) {
  Scene scene;
  QStringList titles;
  const auto closeModal = [&] {
    QTimer::singleShot(0, [&] {
      QWidget* modal = QApplication::activeModalWidget();
      ASSERT_TRUE(modal);
      titles << modal->windowTitle();
      modal->close();
    });
  };
  closeModal();
  showLineNumberingDialog(scene.ide.vbe, scene.settings, scene.options, nullptr);
  closeModal();
  showIndentationDialog(scene.ide.vbe, scene.settings, scene.options, nullptr);
  EXPECT_EQ(titles, (QStringList{u"Quimbel - Numerar Linhas"_qs, u"Quimbel - Indentar Código"_qs}));
  // Closing wrote the indenter's choice.
  EXPECT_EQ(scene.settings.value(common::setting::UseOption), u"0"_qs);
}

}  // namespace
}  // namespace transform
