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
    m_form = component(u"Loja"_qs, u"frmPrincipal"_qs);
    ASSERT_TRUE(m_form);
    m_ide.vbe->activateWindow(m_form->designerWindow());
    settle();
    m_designer = m_window->windows().activeDesigner();
    ASSERT_NE(m_designer, nullptr);
    m_events.push_back(m_ide.vbe->events().controls->ItemAdded.connect(
        [this](const ide::Ref<ide::VBControl>& c) { m_log << u"added "_qs + c->name(); }));
    m_events.push_back(m_ide.vbe->events().controls->ItemRemoved.connect(
        [this](const ide::Ref<ide::VBControl>& c) { m_log << u"removed "_qs + c->name(); }));
    m_events.push_back(m_ide.vbe->events().controls->ItemRenamed.connect(
        [this](const ide::Ref<ide::VBControl>& c, const QString& oldName, int oldIndex) {
          m_log << u"renamed %1 from %2 (%3)"_qs.arg(c->name(), oldName).arg(oldIndex);
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

TEST_F(DesignerTest, TheActiveWindowDrawsTheControlsAtTheirPlacesInPixels) {
  EXPECT_EQ(m_ide.vbe->ActiveWindow(), m_form->designerWindow());
  EXPECT_EQ(m_window->mdiArea()->activeSubWindow()->windowTitle(), u"Loja - frmPrincipal (Form)"_qs);
  FormCanvas* canvas = m_designer->canvas();
  const QPoint origin = canvas->clientOrigin();
  // cmdNovoPedido: Left 6240, Top 1440, Width 1455, Height 375 twips.
  EXPECT_EQ(canvas->rectOf(control(u"cmdNovoPedido"_qs)), QRect(origin + QPoint(416, 96), QSize(97, 25)));
  // txtPesquisa: Left 120, Top 480, Width 5895, Height 315 twips.
  EXPECT_EQ(canvas->rectOf(control(u"txtPesquisa"_qs)), QRect(origin + QPoint(8, 32), QSize(393, 21)));
  EXPECT_TRUE(canvas->rectOf(control(u"mnuArquivo"_qs)).isEmpty()) << "menus are not controls on the form";
  // The client area is ClientWidth 7800 by ClientHeight 5430 twips.
  EXPECT_GE(canvas->sizeHint().width(), origin.x() + 520);
  EXPECT_GE(canvas->sizeHint().height(), origin.y() + 362);
}

TEST_F(DesignerTest, TheToolboxAddsEachIntrinsicControlAndTheEventFires) {
  ASSERT_TRUE(m_window->toolbox().click(u"TextBox"_qs));
  ASSERT_TRUE(control(u"Text1"_qs));
  EXPECT_EQ(m_log, QStringList{u"added Text1"_qs});
  EXPECT_EQ(m_designer->selectedControl(), control(u"Text1"_qs));
  EXPECT_EQ(m_window->properties().shownValue(u"Name"_qs), u"Text1"_qs);
  EXPECT_TRUE(m_form->IsDirty());
  // Every other intrinsic class too.
  for (const QString& className : Toolbox::controlClasses())
    ASSERT_TRUE(m_window->toolbox().click(className)) << className.toStdString();
  EXPECT_EQ(m_log.size(), Toolbox::controlClasses().size() + 1);
  EXPECT_TRUE(control(u"Command1"_qs));
  EXPECT_TRUE(control(u"Timer1"_qs));
  EXPECT_TRUE(control(u"Image1"_qs));
}

TEST_F(DesignerTest, ChangingNameInTheGridRenamesTheControl) {
  m_designer->selectControl(control(u"cmdEditar"_qs));
  settle();
  ASSERT_TRUE(m_window->properties().applyEdit(u"Name"_qs, u"cmdAlterar"_qs));
  EXPECT_TRUE(control(u"cmdAlterar"_qs));
  EXPECT_FALSE(control(u"cmdEditar"_qs));
  EXPECT_EQ(m_log, QStringList{u"renamed cmdAlterar from cmdEditar (-1)"_qs});
}

TEST_F(DesignerTest, ARefusedValueIsReportedAndTheGridShowsTheValueAgain) {
  m_designer->selectControl(control(u"cmdEditar"_qs));
  m_ide.ui->queueAnswer(ide::mb::OK);
  EXPECT_FALSE(m_window->properties().applyEdit(u"Name"_qs, u"cmdNovoPedido"_qs));
  ASSERT_EQ(m_messages.size(), 1);
  EXPECT_TRUE(m_messages.front().contains(u"Name"_qs)) << m_messages.front().toStdString();
  EXPECT_EQ(m_window->properties().shownValue(u"Name"_qs), u"cmdEditar"_qs);
}

TEST_F(DesignerTest, TheGridShowsValueNamesAndChangesProperties) {
  m_designer->selectControl(nullptr);
  settle();
  EXPECT_EQ(m_window->properties().shownValue(u"StartUpPosition"_qs), u"2 - CenterScreen"_qs);
  EXPECT_EQ(m_window->properties().shownValue(u"BackColor"_qs), u"&H8000000F&"_qs);
  ASSERT_TRUE(m_window->properties().applyEdit(u"Caption"_qs, u"Loja"_qs));
  EXPECT_EQ(
      std::static_pointer_cast<host::ControlImpl>(m_form->form()->Root())->property(u"Caption"_qs).toString(),
      u"Loja"_qs);
  ASSERT_TRUE(m_window->properties().applyEdit(u"StartUpPosition"_qs, u"1 - CenterOwner"_qs));
  EXPECT_EQ(m_window->properties().shownValue(u"StartUpPosition"_qs), u"1 - CenterOwner"_qs);
}

TEST_F(DesignerTest, DraggingMovesTheControlOnTheGrid) {
  m_window->show();
  FormCanvas* canvas = m_designer->canvas();
  auto button = control(u"cmdEditar"_qs);  // Left 6240, Top 960
  const QPoint start = canvas->rectOf(button).center();
  QTest::mousePress(canvas, Qt::LeftButton, {}, start);
  QTest::mouseMove(canvas, start + QPoint(-21, 19));
  QTest::mouseRelease(canvas, Qt::LeftButton, {}, start + QPoint(-21, 19));
  // Whole grid steps of 8 pixels (120 twips): -16 and +16 pixels.
  EXPECT_EQ(button->property(u"Left"_qs).toInt(), 6240 - 240);
  EXPECT_EQ(button->property(u"Top"_qs).toInt(), 960 + 240);
}

TEST_F(DesignerTest, DeleteRemovesTheSelectedControlAndTheEventFires) {
  m_window->show();
  FormCanvas* canvas = m_designer->canvas();
  auto button = control(u"cmdEditar"_qs);
  QTest::mouseClick(canvas, Qt::LeftButton, {}, canvas->rectOf(button).center());
  ASSERT_EQ(m_designer->selectedControl(), button);
  QTest::keyClick(canvas, Qt::Key_Delete);
  EXPECT_FALSE(control(u"cmdEditar"_qs));
  EXPECT_EQ(m_log, QStringList{u"removed cmdEditar"_qs});
  EXPECT_EQ(m_designer->selectedControl(), nullptr);
}

/// frmSobre: a Fixed Dialog with a user control holding controls, an AutoSize label aligned right, values
/// of its binary file, and a label with a font of its own.
class SobreTest : public test::IdeTest {
 protected:
  void SetUp() override {
    IdeTest::SetUp();
    auto form = component(u"Loja"_qs, u"frmSobre"_qs);
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
  const QRect panel = canvas->rectOf(control(u"ctlPainel1"_qs));
  EXPECT_EQ(panel, QRect(origin + QPoint(8, 192), QSize(296, 104)));
  // cboIdioma at Left 120, Top 480 inside it.
  const QRect combo = canvas->rectOf(control(u"cboIdioma"_qs));
  EXPECT_EQ(combo, QRect(panel.topLeft() + QPoint(8, 32), QSize(153, 21)));
  m_window->show();
  QTest::mouseClick(canvas, Qt::LeftButton, {}, combo.center());
  EXPECT_EQ(m_designer->selectedControl(), control(u"cboIdioma"_qs));
  QTest::keyClick(canvas, Qt::Key_Escape);
  EXPECT_EQ(m_designer->selectedControl(), control(u"ctlPainel1"_qs)) << "Escape selects the container";
  // A control added while the user control is selected goes inside it.
  ASSERT_TRUE(m_window->toolbox().click(u"OptionButton"_qs));
  EXPECT_EQ(control(u"Option1"_qs)->liveNode().parent(), &control(u"ctlPainel1"_qs)->liveNode());
}

TEST_F(SobreTest, FontsAndAutoSizeLabels) {
  // Each control's own font, else its container's: lblTitulo is Tahoma 12 bold, cmdOk the form's Tahoma 8.25.
  const QFont title = vbFont(control(u"lblTitulo"_qs)->font());
  EXPECT_EQ(title.pixelSize(), 16);
  EXPECT_TRUE(title.bold());
  EXPECT_EQ(vbFont(control(u"cmdOk"_qs)->font()).pixelSize(), 11);
  EXPECT_EQ(control(u"cmdOk"_qs)->font().name, u"Tahoma"_qs);
  // Stand-ins of the classic fonts (fonts-wine and fonts-liberation are installed with the IDE).
  const std::pair<const char*, const char*> families[] = {{"MS Sans Serif", "Tahoma"},
                                                          {"Tahoma", "Tahoma"},
                                                          {"Arial", "Liberation Sans"},
                                                          {"Courier New", "Liberation Mono"},
                                                          {"Fonte Inexistente", "DejaVu Sans"}};
  for (const auto& [name, family] : families)
    EXPECT_EQ(fontFamilyFor(QString::fromLatin1(name)), QLatin1StringView(family)) << name;
  // An AutoSize label aligned right keeps its right edge (Left 4920 + Width 975 twips) and grows to the left.
  const QRect version = m_designer->canvas()->rectOf(control(u"lblVersao"_qs));
  EXPECT_EQ(version.right() + 1, m_designer->canvas()->clientOrigin().x() + 393);
  const int text =
      QFontMetrics(vbFont(control(u"lblVersao"_qs)->font())).horizontalAdvance(u"Versão 1.4.12"_qs);
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
    root->setProperty(u"BorderStyle"_qs, c.borderStyle);
    root->setProperty(u"ControlBox"_qs, c.controlBox);
    root->setProperty(u"MinButton"_qs, c.minButton);
    root->setProperty(u"MaxButton"_qs, c.maxButton);
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
  auto version = control(u"lblVersao"_qs);
  version->setProperty(u"WordWrap"_qs, true);
  version->setProperty(u"Caption"_qs, u"Versão 1.4.12 de março"_qs);
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
  auto licence = control(u"txtLicenca"_qs);
  const QRect box = canvas->rectOf(licence).adjusted(2, 2, -2, -2);
  const QRect upButton(box.right() - 15, box.top(), 16, 16);
  EXPECT_GT(pixels(upButton.adjusted(4, 4, -4, -4), black), 3);
  licence->setProperty(u"ScrollBars"_qs, 0);
  EXPECT_EQ(pixels(upButton.adjusted(4, 4, -4, -4), black), 0);
  // chkDicas is flat (a black square); at Appearance 1 its box is sunken (grey above, white at the right).
  auto tips = control(u"chkDicas"_qs);
  const QRect check = canvas->rectOf(tips);
  const QRect indicator(check.left(), check.center().y() - 6, 13, 13);
  const auto grey = [](const QColor& c) { return c == QColor(0x80, 0x80, 0x80); };
  EXPECT_EQ(pixels(QRect(indicator.topLeft(), QSize(13, 1)), black), 13);
  tips->setProperty(u"Appearance"_qs, 1);
  EXPECT_EQ(pixels(QRect(indicator.topLeft(), QSize(12, 1)), grey), 12);
}

TEST_F(SobreTest, ThePropertiesWindowNamesBinaryValuesByTheirKind) {
  PropertiesView& properties = m_window->properties();
  m_designer->selectControl(nullptr);
  settle();
  EXPECT_EQ(properties.shownValue(u"Icon"_qs), u"(Icon)"_qs);
  EXPECT_EQ(properties.shownValue(u"Picture"_qs), u"(None)"_qs);
  m_designer->selectControl(control(u"imgLogo"_qs));
  settle();
  EXPECT_EQ(properties.shownValue(u"Picture"_qs), u"(Bitmap)"_qs);
  m_designer->selectControl(control(u"cboIdioma"_qs));
  settle();
  EXPECT_EQ(properties.shownValue(u"List"_qs), u"(List)"_qs);
  m_designer->selectControl(control(u"txtLicenca"_qs));
  settle();
  EXPECT_TRUE(properties.shownValue(u"Text"_qs).startsWith(u"Loja - Gestão de Pedidos¶Copyright"_qs));
}

}  // namespace
}  // namespace desktop
