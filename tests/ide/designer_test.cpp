// SPDX-License-Identifier: MIT
// Form designers and the properties window: controls drawn at their twips positions, added from the toolbox,
// moved with the mouse, removed with Delete, renamed and made array elements in the grid; every change goes
// through the form and fires the control events.
#include "designerview.h"
#include "host/model/events.h"
#include "idefixture.h"
#include "propertiesview.h"
#include "toolbox.h"
#include "vbfonts.h"
#include "windowmanager.h"

#include <gtest/gtest.h>

#include <QMdiArea>
#include <QMdiSubWindow>
#include <QTableWidget>
#include <QTest>

namespace desktop {
namespace {

using test::settle;

class DesignerTest : public test::IdeTest {
 protected:
  void SetUp() override {
    IdeTest::SetUp();
    m_form = component(QStringLiteral("Loja"), QStringLiteral("frmPrincipal"));
    ASSERT_TRUE(m_form);
    m_ide.vbe->activateWindow(m_form->designerWindow());
    settle();
    m_designer = m_window->windows().activeDesigner();
    ASSERT_NE(m_designer, nullptr);
    m_events.push_back(m_ide.vbe->events().controls->ItemAdded.connect(
        [this](const ide::Ref<ide::VBControl>& c) { m_log << QStringLiteral("added ") + c->name(); }));
    m_events.push_back(m_ide.vbe->events().controls->ItemRemoved.connect(
        [this](const ide::Ref<ide::VBControl>& c) { m_log << QStringLiteral("removed ") + c->name(); }));
    m_events.push_back(m_ide.vbe->events().controls->ItemRenamed.connect(
        [this](const ide::Ref<ide::VBControl>& c, const QString& oldName, int oldIndex) {
          m_log << QStringLiteral("renamed %1 from %2 (%3)").arg(c->name(), oldName).arg(oldIndex);
        }));
  }
  std::shared_ptr<host::ControlImpl> control(const QString& name) const {
    return m_designer->form()->findControl(name);
  }

  std::shared_ptr<host::ComponentImpl> m_form;
  DesignerWindow* m_designer = nullptr;
  std::vector<ide::Connection> m_events;
  QStringList m_log;
};

TEST_F(DesignerTest, ControlsAreDrawnAtTheirPlacesInPixels) {
  FormCanvas* canvas = m_designer->canvas();
  const QPoint origin = canvas->clientOrigin();
  // cmdNovoPedido: Left 6240, Top 1440, Width 1455, Height 375 twips.
  EXPECT_EQ(canvas->rectOf(control(QStringLiteral("cmdNovoPedido"))),
            QRect(origin + QPoint(416, 96), QSize(97, 25)));
  // txtPesquisa: Left 120, Top 480, Width 5895, Height 315 twips.
  EXPECT_EQ(canvas->rectOf(control(QStringLiteral("txtPesquisa"))),
            QRect(origin + QPoint(8, 32), QSize(393, 21)));
  EXPECT_TRUE(canvas->rectOf(control(QStringLiteral("mnuArquivo"))).isEmpty())
      << "menus are not controls on the form";
  // The client area is ClientWidth 7800 by ClientHeight 5430 twips.
  EXPECT_GE(canvas->sizeHint().width(), origin.x() + 520);
  EXPECT_GE(canvas->sizeHint().height(), origin.y() + 362);
}

TEST_F(DesignerTest, TheDesignerWindowIsTheActiveWindow) {
  EXPECT_EQ(m_ide.vbe->ActiveWindow(), m_form->designerWindow());
  EXPECT_EQ(m_window->mdiArea()->activeSubWindow()->windowTitle(),
            QStringLiteral("Loja - frmPrincipal (Form)"));
}

TEST_F(DesignerTest, TheToolboxAddsAControlAndTheEventFires) {
  ASSERT_TRUE(m_window->toolbox().click(QStringLiteral("TextBox")));
  ASSERT_TRUE(control(QStringLiteral("Text1")));
  EXPECT_EQ(m_log, QStringList{QStringLiteral("added Text1")});
  EXPECT_EQ(m_designer->selectedControl(), control(QStringLiteral("Text1")));
  EXPECT_EQ(m_window->properties().shownValue(QStringLiteral("Name")), QStringLiteral("Text1"));
  EXPECT_TRUE(m_form->IsDirty());
}

TEST_F(DesignerTest, EveryIntrinsicControlCanBeAdded) {
  for (const QString& className : Toolbox::controlClasses())
    ASSERT_TRUE(m_window->toolbox().click(className)) << className.toStdString();
  EXPECT_EQ(m_log.size(), Toolbox::controlClasses().size());
  EXPECT_TRUE(control(QStringLiteral("Command1")));
  EXPECT_TRUE(control(QStringLiteral("Timer1")));
  EXPECT_TRUE(control(QStringLiteral("Image1")));
}

TEST_F(DesignerTest, ChangingNameInTheGridRenamesTheControl) {
  m_designer->selectControl(control(QStringLiteral("cmdEditar")));
  settle();
  ASSERT_TRUE(m_window->properties().applyEdit(QStringLiteral("Name"), QStringLiteral("cmdAlterar")));
  EXPECT_TRUE(control(QStringLiteral("cmdAlterar")));
  EXPECT_FALSE(control(QStringLiteral("cmdEditar")));
  EXPECT_EQ(m_log, QStringList{QStringLiteral("renamed cmdAlterar from cmdEditar (-1)")});
}

TEST_F(DesignerTest, ChangingIndexInTheGridMakesAnArrayElement) {
  m_designer->selectControl(control(QStringLiteral("cmdEditar")));
  ASSERT_TRUE(m_window->properties().applyEdit(QStringLiteral("Index"), QStringLiteral("0")));
  EXPECT_EQ(control(QStringLiteral("cmdEditar"))->property(QStringLiteral("Index")).toInt(), 0);
  EXPECT_EQ(m_log, QStringList{QStringLiteral("renamed cmdEditar from cmdEditar (-1)")});
}

TEST_F(DesignerTest, ARefusedValueIsReportedAndTheGridShowsTheValueAgain) {
  m_designer->selectControl(control(QStringLiteral("cmdEditar")));
  m_ide.ui->queueAnswer(ide::mb::OK);
  EXPECT_FALSE(m_window->properties().applyEdit(QStringLiteral("Name"), QStringLiteral("cmdNovoPedido")));
  ASSERT_EQ(m_messages.size(), 1);
  EXPECT_TRUE(m_messages.front().contains(QStringLiteral("Name"))) << m_messages.front().toStdString();
  EXPECT_EQ(m_window->properties().shownValue(QStringLiteral("Name")), QStringLiteral("cmdEditar"));
}

TEST_F(DesignerTest, TheGridShowsValueNamesAndChangesProperties) {
  m_designer->selectControl(nullptr);
  settle();
  EXPECT_EQ(m_window->properties().shownValue(QStringLiteral("StartUpPosition")),
            QStringLiteral("2 - CenterScreen"));
  EXPECT_EQ(m_window->properties().shownValue(QStringLiteral("BackColor")), QStringLiteral("&H8000000F&"));
  ASSERT_TRUE(m_window->properties().applyEdit(QStringLiteral("Caption"), QStringLiteral("Loja")));
  EXPECT_EQ(std::static_pointer_cast<host::ControlImpl>(m_form->form()->Root())
                ->property(QStringLiteral("Caption"))
                .toString(),
            QStringLiteral("Loja"));
  ASSERT_TRUE(
      m_window->properties().applyEdit(QStringLiteral("StartUpPosition"), QStringLiteral("1 - CenterOwner")));
  EXPECT_EQ(m_window->properties().shownValue(QStringLiteral("StartUpPosition")),
            QStringLiteral("1 - CenterOwner"));
}

TEST_F(DesignerTest, DraggingMovesTheControlOnTheGrid) {
  m_window->show();
  FormCanvas* canvas = m_designer->canvas();
  auto button = control(QStringLiteral("cmdEditar"));  // Left 6240, Top 960
  const QPoint start = canvas->rectOf(button).center();
  QTest::mousePress(canvas, Qt::LeftButton, {}, start);
  QTest::mouseMove(canvas, start + QPoint(-21, 19));
  QTest::mouseRelease(canvas, Qt::LeftButton, {}, start + QPoint(-21, 19));
  // Whole grid steps of 8 pixels (120 twips): -16 and +16 pixels.
  EXPECT_EQ(button->property(QStringLiteral("Left")).toInt(), 6240 - 240);
  EXPECT_EQ(button->property(QStringLiteral("Top")).toInt(), 960 + 240);
}

TEST_F(DesignerTest, DeleteRemovesTheSelectedControlAndTheEventFires) {
  m_window->show();
  FormCanvas* canvas = m_designer->canvas();
  auto button = control(QStringLiteral("cmdEditar"));
  QTest::mouseClick(canvas, Qt::LeftButton, {}, canvas->rectOf(button).center());
  ASSERT_EQ(m_designer->selectedControl(), button);
  QTest::keyClick(canvas, Qt::Key_Delete);
  EXPECT_FALSE(control(QStringLiteral("cmdEditar")));
  EXPECT_EQ(m_log, QStringList{QStringLiteral("removed cmdEditar")});
  EXPECT_EQ(m_designer->selectedControl(), nullptr);
}

/// frmSobre: a Fixed Dialog with a user control holding controls, an AutoSize label aligned right, values
/// of its binary file, and a label with a font of its own.
class SobreTest : public test::IdeTest {
 protected:
  void SetUp() override {
    IdeTest::SetUp();
    auto form = component(QStringLiteral("Loja"), QStringLiteral("frmSobre"));
    ASSERT_TRUE(form);
    m_ide.vbe->activateWindow(form->designerWindow());
    settle();
    m_designer = m_window->windows().activeDesigner();
    ASSERT_NE(m_designer, nullptr);
  }
  std::shared_ptr<host::ControlImpl> control(const QString& name) const {
    return m_designer->form()->findControl(name);
  }
  DesignerWindow* m_designer = nullptr;
};

TEST_F(SobreTest, ControlsInsideAUserControlAreDrawnAndSelectedInIt) {
  FormCanvas* canvas = m_designer->canvas();
  const QPoint origin = canvas->clientOrigin();
  // ctlPainel1 has no Width or Height: _ExtentX 7832, _ExtentY 2752 HIMETRIC are 4440 by 1560 twips.
  const QRect panel = canvas->rectOf(control(QStringLiteral("ctlPainel1")));
  EXPECT_EQ(panel, QRect(origin + QPoint(8, 192), QSize(296, 104)));
  // cboIdioma at Left 120, Top 480 inside it.
  const QRect combo = canvas->rectOf(control(QStringLiteral("cboIdioma")));
  EXPECT_EQ(combo, QRect(panel.topLeft() + QPoint(8, 32), QSize(153, 21)));
  m_window->show();
  QTest::mouseClick(canvas, Qt::LeftButton, {}, combo.center());
  EXPECT_EQ(m_designer->selectedControl(), control(QStringLiteral("cboIdioma")));
  QTest::keyClick(canvas, Qt::Key_Escape);
  EXPECT_EQ(m_designer->selectedControl(), control(QStringLiteral("ctlPainel1")))
      << "Escape selects the container";
  // A control added while the user control is selected goes inside it.
  ASSERT_TRUE(m_window->toolbox().click(QStringLiteral("OptionButton")));
  EXPECT_EQ(control(QStringLiteral("Option1"))->liveNode().parent(),
            &control(QStringLiteral("ctlPainel1"))->liveNode());
}

TEST_F(SobreTest, FontsAndAutoSizeLabels) {
  // Each control's own font, else its container's: lblTitulo is Tahoma 12 bold, cmdOk the form's Tahoma 8.25.
  const QFont title = vbFont(control(QStringLiteral("lblTitulo"))->font());
  EXPECT_EQ(title.pixelSize(), 16);
  EXPECT_TRUE(title.bold());
  EXPECT_EQ(vbFont(control(QStringLiteral("cmdOk"))->font()).pixelSize(), 11);
  EXPECT_EQ(control(QStringLiteral("cmdOk"))->font().name, QStringLiteral("Tahoma"));
  // Stand-ins of the classic fonts (fonts-wine and fonts-liberation are installed with the IDE).
  const std::pair<const char*, const char*> families[] = {{"MS Sans Serif", "MS Sans Serif"},
                                                          {"Tahoma", "Tahoma"},
                                                          {"Arial", "Liberation Sans"},
                                                          {"Courier New", "Liberation Mono"},
                                                          {"Fonte Inexistente", "DejaVu Sans"}};
  for (const auto& [name, family] : families)
    EXPECT_EQ(fontFamilyFor(QString::fromLatin1(name)), QLatin1StringView(family)) << name;
  // An AutoSize label aligned right keeps its right edge (Left 4920 + Width 975 twips) and grows to the left.
  const QRect version = m_designer->canvas()->rectOf(control(QStringLiteral("lblVersao")));
  EXPECT_EQ(version.right() + 1, m_designer->canvas()->clientOrigin().x() + 393);
  const int text = QFontMetrics(vbFont(control(QStringLiteral("lblVersao"))->font()))
                       .horizontalAdvance(QStringLiteral("Versão 1.4.12"));
  EXPECT_GE(version.width(), text);
  EXPECT_LE(version.width(), text + 2);
}

TEST_F(SobreTest, TheFrameFollowsBorderStyleControlBoxMinButtonAndMaxButton) {
  struct Case {
    int borderStyle;
    bool controlBox, minButton, maxButton;
    int titleHeight;
    bool icon, close, minMax;
  };
  const Case cases[] = {
      {2, true, true, true, 18, true, true, true},     {1, true, false, true, 18, true, true, true},
      {3, true, false, false, 18, false, true, false}, {3, true, true, false, 18, false, true, true},
      {4, true, true, true, 15, false, true, false},   {5, true, true, true, 15, false, true, false},
      {2, false, true, true, 18, false, false, false}, {0, true, true, true, 0, false, false, false},
  };
  auto root = std::static_pointer_cast<host::ControlImpl>(m_designer->form()->Root());
  for (const Case& c : cases) {
    root->setProperty(QStringLiteral("BorderStyle"), c.borderStyle);
    root->setProperty(QStringLiteral("ControlBox"), c.controlBox);
    root->setProperty(QStringLiteral("MinButton"), c.minButton);
    root->setProperty(QStringLiteral("MaxButton"), c.maxButton);
    const FormFrame frame = m_designer->canvas()->geometry().frame();
    SCOPED_TRACE(c.borderStyle);
    EXPECT_EQ(frame.titleHeight, c.titleHeight);
    EXPECT_EQ(frame.icon, c.icon);
    EXPECT_EQ(frame.closeButton, c.close);
    EXPECT_EQ(frame.minMaxButtons, c.minMax);
    EXPECT_EQ(frame.minEnabled, c.minButton);
  }
}

TEST_F(SobreTest, WordWrapScrollBarsAndFlatBorders) {
  FormCanvas* canvas = m_designer->canvas();
  // An AutoSize label with WordWrap keeps its width and grows downwards.
  auto version = control(QStringLiteral("lblVersao"));
  version->setProperty(QStringLiteral("WordWrap"), true);
  version->setProperty(QStringLiteral("Caption"), QStringLiteral("Versão 1.4.12 de março"));
  const QRect wrapped = canvas->rectOf(version);
  EXPECT_EQ(wrapped.width(), 65);
  EXPECT_GE(wrapped.height(), 2 * QFontMetrics(vbFont(version->font())).height());

  const auto pixels = [&](const QRect& area, auto&& predicate) {
    const QImage image = canvas->grab().toImage();
    int count = 0;
    for (int y = area.top(); y <= area.bottom(); ++y)
      for (int x = area.left(); x <= area.right(); ++x)
        count += predicate(image.pixelColor(x, y)) ? 1 : 0;
    return count;
  };
  const auto black = [](const QColor& c) { return c == Qt::black; };
  // txtLicenca (ScrollBars 2) has its up arrow inside its 3-D border; without scroll bars that corner is
  // text.
  auto licence = control(QStringLiteral("txtLicenca"));
  const QRect box = canvas->rectOf(licence).adjusted(2, 2, -2, -2);
  const QRect upButton(box.right() - 15, box.top(), 16, 16);
  EXPECT_GT(pixels(upButton.adjusted(4, 4, -4, -4), black), 3);
  licence->setProperty(QStringLiteral("ScrollBars"), 0);
  EXPECT_EQ(pixels(upButton.adjusted(4, 4, -4, -4), black), 0);
  // chkDicas is flat (a black square); at Appearance 1 its box is sunken (grey above, white at the right).
  auto tips = control(QStringLiteral("chkDicas"));
  const QRect check = canvas->rectOf(tips);
  const QRect indicator(check.left(), check.center().y() - 6, 13, 13);
  const auto grey = [](const QColor& c) { return c == QColor(0x80, 0x80, 0x80); };
  EXPECT_EQ(pixels(QRect(indicator.topLeft(), QSize(13, 1)), black), 13);
  tips->setProperty(QStringLiteral("Appearance"), 1);
  EXPECT_EQ(pixels(QRect(indicator.topLeft(), QSize(12, 1)), grey), 12);
}

TEST_F(SobreTest, ThePropertiesWindowNamesBinaryValuesByTheirKind) {
  PropertiesView& properties = m_window->properties();
  m_designer->selectControl(nullptr);
  settle();
  EXPECT_EQ(properties.shownValue(QStringLiteral("Icon")), QStringLiteral("(Icon)"));
  EXPECT_EQ(properties.shownValue(QStringLiteral("Picture")), QStringLiteral("(None)"));
  m_designer->selectControl(control(QStringLiteral("imgLogo")));
  settle();
  EXPECT_EQ(properties.shownValue(QStringLiteral("Picture")), QStringLiteral("(Bitmap)"));
  m_designer->selectControl(control(QStringLiteral("cboIdioma")));
  settle();
  EXPECT_EQ(properties.shownValue(QStringLiteral("List")), QStringLiteral("(List)"));
  m_designer->selectControl(control(QStringLiteral("txtLicenca")));
  settle();
  EXPECT_TRUE(properties.shownValue(QStringLiteral("Text"))
                  .startsWith(QStringLiteral("Loja - Gestão de Pedidos¶Copyright")));
}

}  // namespace
}  // namespace desktop
