// SPDX-License-Identifier: MIT
// CEnvUtils: the selected text, the kinds of property procedures, menu items and the IDE's mode.
#include "addin/envutils.h"
#include "addinfixture.h"
#include "common/uiutils.h"
#include "host/model/objects.h"

#include <gtest/gtest.h>

#include <QImage>

namespace addin::test {
namespace {

struct ModuleIde {
  ModuleIde() {
    auto project = vbe->newProject();
    component = addModule(project, u"modUm"_qs, 0, 0);
    component->CodeModule()->AddFromString(
        QStringLiteral("Public Property Get Valor() As Long\r\n    Valor = m\r\nEnd Property\r\n\r\n"
                       "Public Property Let Valor(ByVal v As Long)\r\n    m = v\r\nEnd Property\r\n"
                       "Public Property Set Objeto(ByVal o As Object)\r\nEnd Property"));
    pane = showAt(component, 1);
  }
  std::shared_ptr<host::VbeImpl> vbe = host::VbeImpl::create();
  std::shared_ptr<host::ComponentImpl> component;
  ide::Ref<ide::CodePane> pane;
  CEnvUtils utils{*vbe};
};

TEST(GetSelectedText, OneLineSeveralLinesAndNoSelection) {
  ModuleIde ide;
  // Line 1 "Option Explicit", line 2 "Private m As Long", line 3 "Public Property Get Valor() As Long".
  ide.pane->SetSelection(1, 8, 1, 16);
  EXPECT_EQ(ide.utils.GetSelectedText(), u"Explicit"_qs);
  ide.pane->SetSelection(1, 8, 3, 7);
  EXPECT_EQ(ide.utils.GetSelectedText(), u"Explicit\r\nPrivate m As Long\r\nPublic"_qs);
  ide.pane->SetSelection(1, 8, 2, 1);
  EXPECT_EQ(ide.utils.GetSelectedText(), u"Explicit\r\n"_qs);
  ide.pane->SetSelection(2, 5, 2, 5);
  EXPECT_EQ(ide.utils.GetSelectedText(), QString());
  ide.pane->Window()->Close();
  EXPECT_EQ(ide.utils.GetSelectedText(), QString()) << "no code window";
}

TEST(GetPropertyType, TheKindWhoseLinesHoldTheLine) {
  ModuleIde ide;
  auto module = ide.component->CodeModule();
  EXPECT_EQ(ide.utils.GetPropertyType(module, u"Valor"_qs, 4), ide::ProcKind::Get);
  EXPECT_EQ(ide.utils.GetPropertyType(module, u"Valor"_qs, 8), ide::ProcKind::Let);
  EXPECT_EQ(ide.utils.GetPropertyType(module, u"Objeto"_qs, 11), ide::ProcKind::Set);
  EXPECT_EQ(ide.utils.GetPropertyType(module, u"Inexistente"_qs, 4), ide::ProcKind::Proc);
}

TEST(AddMenuItem, AppendsOrInsertsATemporaryButtonWithItsPicture) {
  auto vbe = host::VbeImpl::create();
  CEnvUtils utils(*vbe);
  auto menu = vbe->CommandBars()->Item(u"Add-Ins"_qs);
  const int before = menu->Controls()->Count();
  {
    OwnedControl last = utils.AddMenuItem(menu, u"Último"_qs, 0, true, 3);
    OwnedControl first = utils.AddMenuItem(menu, u"Primeiro"_qs, 1, false, 0);
    EXPECT_EQ(menu->Controls()->Count(), before + 2);
    EXPECT_EQ(menu->Controls()->Item(1)->Caption(), u"Primeiro"_qs);
    EXPECT_EQ(menu->Controls()->Item(before + 2)->Caption(), u"Último"_qs);
    EXPECT_TRUE(last->BeginGroup());
    EXPECT_TRUE(last->Temporary());
    EXPECT_EQ(last->Style(), ide::ButtonStyle::IconAndCaption);
    EXPECT_EQ(QImage::fromData(last->Face()).size(), QSize(16, 16));
    EXPECT_FALSE(first->BeginGroup());
    EXPECT_TRUE(first->Face().isEmpty());
    // Deleted by someone else already: releasing it is no failure.
    first->Delete();
  }
  EXPECT_EQ(menu->Controls()->Count(), before) << "released items leave the menu";
}

TEST(IdeMode, ReadFromTheStandardBarsContinueAndEnd) {
  auto vbe = host::VbeImpl::create();
  CEnvUtils utils(*vbe);
  EXPECT_EQ(utils.IdeMode(), ide::IdeMode::Design);
  vbe->setMode(ide::IdeMode::Run);
  EXPECT_EQ(utils.IdeMode(), ide::IdeMode::Run);
  vbe->setMode(ide::IdeMode::Break);
  EXPECT_EQ(utils.IdeMode(), ide::IdeMode::Break);
  vbe->setMode(ide::IdeMode::Design);
  EXPECT_EQ(utils.IdeMode(), ide::IdeMode::Design);
  // A "Continue" button put back after being removed is found again.
  auto standard = vbe->CommandBars()->Item(u"Standard"_qs)->Controls();
  standard->Item(u"Continue"_qs)->Delete();
  EXPECT_THROW(utils.IdeMode(), ide::Error);
  auto again = standard->Add(ide::ControlType::Button, 1, {}, 0, true);
  again->setCaption(u"Continue"_qs);
  again->setEnabled(true);
  EXPECT_EQ(utils.IdeMode(), ide::IdeMode::Break);
}

TEST(UiHelpers, CursorsWindowLocksAndTheSplashAreRestoredWhenReleased) {
  auto vbe = host::VbeImpl::create();
  host::HeadlessUi& ui = *vbe->headlessUi();
  {
    common::CHourGlass hourglass(ui);
    EXPECT_EQ(ui.cursor(), ide::Cursor::Hourglass);
    {
      common::CArrowHourglass arrow(ui);
      EXPECT_EQ(ui.cursor(), ide::Cursor::ArrowHourglass);
    }
    EXPECT_EQ(ui.cursor(), ide::Cursor::Hourglass);
  }
  EXPECT_EQ(ui.cursor(), ide::Cursor::Default);

  auto& windows = vbe->windowSystem();
  const ide::HWnd main = vbe->MainWindow()->hWnd();
  {
    common::CLockWindowUpdate lock(windows);
    EXPECT_TRUE(lock.LockWindow(main));
    EXPECT_EQ(windows.lockedWindow(), main);
    common::CLockWindowUpdate other(windows);
    EXPECT_FALSE(other.LockWindow(vbe->projectWindow()->hWnd())) << "one window at a time";
  }
  EXPECT_EQ(windows.lockedWindow(), 0u);

  {
    common::SplashWindow splash(ui, *vbe->manualLoop(), u"Quimbel 2.2"_qs);
    EXPECT_EQ(ui.splashText(), u"Quimbel 2.2"_qs);
  }
  EXPECT_TRUE(ui.splashText().isEmpty());
  EXPECT_EQ(ui.splashHistory().size(), 2u);
}

}  // namespace
}  // namespace addin::test
