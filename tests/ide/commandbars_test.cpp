// SPDX-License-Identifier: MIT
// The command bars drawn live: the menu bar and the toolbars follow every change of the model, clicks go
// to Execute(), faces become icons, and an add-in's menus and toolbar appear when it connects and vanish
// when it disconnects.
#include "commandbarview.h"
#include "host/model/addins.h"
#include "icons.h"
#include "idefixture.h"

#include <gtest/gtest.h>

#include <QAction>
#include <QDir>
#include <QFile>
#include <QMenu>
#include <QMenuBar>
#include <QTemporaryDir>
#include <QToolBar>

namespace desktop {
namespace {

using test::settle;
using test::waitFor;

class CommandBarsTest : public test::IdeTest {
 protected:
  host::CommandBarsImpl& bars() { return *m_ide.vbe->commandBars(); }
  QStringList menuTitles() const {
    QStringList titles;
    for (QAction* action : m_window->menuBar()->actions())
      titles << action->text();
    return titles;
  }
  QStringList toolBarTexts(const QString& name) {
    QStringList texts;
    if (QToolBar* bar = m_window->commandBars().toolBarOf(name))
      for (QAction* action : bar->actions())
        if (!action->isSeparator()) texts << action->text();
    return texts;
  }
};

TEST_F(CommandBarsTest, TheMenuBarShowsTheMenusOfTheModel) {
  EXPECT_EQ(menuTitles(), (QStringList{u"&File"_qs, u"&Edit"_qs, u"&View"_qs, u"&Project"_qs, u"F&ormat"_qs,
                                       u"&Debug"_qs, u"&Run"_qs, u"&Query"_qs, u"D&iagram"_qs, u"&Tools"_qs,
                                       u"&Add-Ins"_qs, u"&Window"_qs, u"&Help"_qs}));
  QMenu* run = m_window->menuBar()->actions().at(6)->menu();
  ASSERT_NE(run, nullptr);
  QStringList items;
  for (QAction* action : run->actions())
    items << action->text() + (action->isEnabled() ? QString() : u" (off)"_qs);
  EXPECT_EQ(items, (QStringList{u"&Start"_qs, u"&Continue (off)"_qs, u"Brea&k (off)"_qs, u"&End (off)"_qs}));
}

TEST_F(CommandBarsTest, TheStandardToolbarHasTheVisibleButtonsWithPictures) {
  const QStringList texts = toolBarTexts(u"Standard"_qs);
  EXPECT_EQ(texts.size(), 16) << "Continue stays hidden in design mode";
  EXPECT_FALSE(texts.contains(u"Continue"_qs));
  EXPECT_EQ(texts.first(), u"Add Project"_qs);
  for (QAction* action : m_window->commandBars().toolBarOf(u"Standard"_qs)->actions()) {
    if (action->isSeparator()) continue;
    EXPECT_FALSE(action->icon().isNull()) << action->text().toStdString();
  }
  EXPECT_EQ(m_window->commandBars().toolBarOf(u"Edit"_qs), nullptr) << "an invisible bar is not drawn";
}

TEST_F(CommandBarsTest, ControlsFollowTheirChanges) {
  auto standard = bars().bar(u"Standard"_qs);
  auto control = std::static_pointer_cast<host::CommandBarControlImpl>(
      standard->Add(ide::ControlType::Button, 1, {}, 1, true));
  control->setCaption(u"First"_qs);
  settle();
  EXPECT_EQ(toolBarTexts(u"Standard"_qs).first(), u"First"_qs);
  QAction* action = m_window->commandBars().actionOf(control.get());
  ASSERT_NE(action, nullptr);
  EXPECT_TRUE(action->isEnabled());

  control->setEnabled(false);
  control->setCaption(u"Renamed"_qs);
  settle();
  EXPECT_EQ(m_window->commandBars().actionOf(control.get()), action) << "the action is kept, not rebuilt";
  EXPECT_FALSE(action->isEnabled());
  EXPECT_EQ(action->text(), u"Renamed"_qs);

  control->setVisible(false);
  settle();
  EXPECT_FALSE(toolBarTexts(u"Standard"_qs).contains(u"Renamed"_qs));
  control->setVisible(true);
  control->Delete();
  settle();
  EXPECT_EQ(m_window->commandBars().actionOf(control.get()), nullptr);
  EXPECT_EQ(toolBarTexts(u"Standard"_qs).size(), 16);
}

TEST_F(CommandBarsTest, AFaceBecomesTheIcon) {
  auto standard = bars().bar(u"Standard"_qs);
  auto pictured = std::static_pointer_cast<host::CommandBarControlImpl>(
      standard->Add(ide::ControlType::Button, 1, {}, 0, true));
  pictured->setTooltipText(u"Pictured"_qs);
  pictured->setFace(glyphPng(Glyph::Find));
  auto broken = std::static_pointer_cast<host::CommandBarControlImpl>(
      standard->Add(ide::ControlType::Button, 1, {}, 0, true));
  broken->setTooltipText(u"Broken"_qs);
  broken->setFace(QByteArray("not a picture"));
  settle();
  QAction* withFace = m_window->commandBars().actionOf(pictured.get());
  QAction* withoutFace = m_window->commandBars().actionOf(broken.get());
  ASSERT_TRUE(withFace && withoutFace);
  EXPECT_FALSE(withFace->icon().isNull());
  EXPECT_TRUE(withoutFace->icon().isNull());
  EXPECT_EQ(withFace->text(), u"Pictured"_qs) << "a button without caption is named by its tooltip";
}

TEST_F(CommandBarsTest, AClickExecutesTheControl) {
  auto addIns = bars().bar(u"Add-Ins"_qs);
  auto control = std::static_pointer_cast<host::CommandBarControlImpl>(
      addIns->Add(ide::ControlType::Button, 1, {}, 0, true));
  control->setCaption(u"Count"_qs);
  int clicks = 0;
  auto sink = m_ide.vbe->Events()->CommandBarEvents(control)->Click.connect(
      [&](const ide::Ref<ide::CommandBarControl>&, bool&, bool&) { ++clicks; });
  settle();
  QAction* action = m_window->commandBars().actionOf(control.get());
  ASSERT_NE(action, nullptr);
  action->trigger();
  EXPECT_EQ(clicks, 1);
  control->setEnabled(false);
  settle();
  action->trigger();
  EXPECT_EQ(clicks, 1) << "a disabled control is not clicked";
}

TEST_F(CommandBarsTest, ANewBarIsAToolbarUntilItIsDeleted) {
  auto bar = bars().Add(u"Mine"_qs, ide::BarPosition::Top, false, true);
  bar->Controls()->Add(ide::ControlType::Button, 1, {}, 0, true)->setCaption(u"One"_qs);
  settle();
  ASSERT_NE(m_window->commandBars().toolBarOf(u"Mine"_qs), nullptr);
  EXPECT_EQ(toolBarTexts(u"Mine"_qs), QStringList{u"One"_qs});
  bar->setVisible(false);
  settle();
  EXPECT_EQ(m_window->commandBars().toolBarOf(u"Mine"_qs), nullptr);
  bar->setVisible(true);
  settle();
  EXPECT_NE(m_window->commandBars().toolBarOf(u"Mine"_qs), nullptr);
  bar->Delete();
  settle();
  EXPECT_EQ(m_window->commandBars().toolBarOf(u"Mine"_qs), nullptr);
}

// ---------------------------------------------------------------------------------------------------
// Add-ins

#ifdef QUIMBEL_ADDIN_LIBRARY
/// What the real add-in needs around it: an installation directory and private settings and data.
class AddInEnvironment {
 public:
  AddInEnvironment() {
    QDir(m_dir.path()).mkpath(u"install/help"_qs);
    QFile config(m_dir.filePath(u"quimbel.conf"_qs));
    config.open(QIODevice::WriteOnly);
    config.write("InstallationPath=" + m_dir.filePath(u"install"_qs).toUtf8() + "\n");
    config.close();
    qputenv("QUIMBEL_MACHINE_CONFIG", m_dir.filePath(u"quimbel.conf"_qs).toLocal8Bit());
    qputenv("QUIMBEL_CONFIG_DIR", m_dir.filePath(u"config"_qs).toLocal8Bit());
    qputenv("QUIMBEL_DATA_DIR", m_dir.filePath(u"data"_qs).toLocal8Bit());
  }
  ~AddInEnvironment() {
    qunsetenv("QUIMBEL_MACHINE_CONFIG");
    qunsetenv("QUIMBEL_CONFIG_DIR");
    qunsetenv("QUIMBEL_DATA_DIR");
  }

 private:
  QTemporaryDir m_dir;
};

TEST_F(CommandBarsTest, TheQuimbelAddInsMenusAndToolbarComeAndGoWithIt) {
  AddInEnvironment environment;
  auto addIn = m_ide.vbe->addIns().registerLibrary(QStringLiteral(QUIMBEL_ADDIN_LIBRARY), false);
  m_ide.ui->queueAnswer(ide::mb::OK);  // a start-up failure would show one box; it must not block the test
  addIn->setConnect(true);
  settle();
  ASSERT_TRUE(addIn->Connect()) << m_messages.join(u'\n').toStdString();

  QToolBar* toolBar = m_window->commandBars().toolBarOf(u"Quimbel 2.2"_qs);
  ASSERT_NE(toolBar, nullptr);
  int buttons = 0;
  for (QAction* action : toolBar->actions()) {
    if (action->isSeparator()) continue;
    ++buttons;
    EXPECT_FALSE(action->icon().isNull()) << action->text().toStdString();
  }
  EXPECT_EQ(buttons, 12);
  EXPECT_EQ(menuTitles().at(10), u"Quimbel"_qs) << "the popup stands before the Add-Ins menu";
  QMenu context;
  m_window->commandBars().fillMenu(&context, bars().bar(u"Code Window"_qs));
  EXPECT_EQ(context.actions().first()->text(), u"Adicionar aos Favoritos"_qs);

  addIn->setConnect(false);
  ASSERT_TRUE(waitFor([&] { return !addIn->Connect(); }));
  settle();
  EXPECT_EQ(m_window->commandBars().toolBarOf(u"Quimbel 2.2"_qs), nullptr);
  EXPECT_FALSE(menuTitles().contains(u"Quimbel"_qs));
  EXPECT_EQ(menuTitles().size(), 13);
}
#endif

}  // namespace
}  // namespace desktop
