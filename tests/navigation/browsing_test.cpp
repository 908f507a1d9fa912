// SPDX-License-Identifier: MIT
// The browse history as the add-in's 100 ms timer records it, driven by the IDE model's clock: a sample
// every sixth tick, places recorded when left after more than two seconds.
#include "addinfixture.h"
#include "common/strings.h"
#include "host/model/objects.h"

#include <gtest/gtest.h>

namespace navigation {
namespace {

using addin::test::AddInEnvironment;
using addin::test::addModule;
using addin::test::LinkedAddIn;
using addin::test::showAt;

// Procedures of 50 lines after two declaration lines: ProcN holds lines 50N - 47 to 50N + 2. With 40
// visible lines the middle line is TopLine + 20, so TopLine 50N - 47 shows ProcN.
int topOf(int procedure) {
  return 50 * procedure - 47;
}

struct Browsing {
  Browsing() {
    addIn.connect();
    auto project = addIn.vbe->newProject();
    one = addModule(project, u"modUm"_qs, 12, 50);
    two = addModule(project, u"modDois"_qs, 3, 50);
    addIn.loop().DoEvents();
  }
  /// Shows ProcN of the module, scrolled there.
  void go(const std::shared_ptr<host::ComponentImpl>& component, int procedure) {
    showAt(component, topOf(procedure));
  }
  void stay(int ms) { addIn.loop().advance(ms); }
  CHistories& histories() { return addIn.globals().Histories(); }
  QStringList places() {
    QStringList names;
    for (int i = 1; i <= histories().HistoryCount(); ++i)
      names << histories().entry(i).CodeModule->Name() + u'.' + histories().entry(i).ProcName;
    return names;
  }
  int shownTopLine() { return addIn.vbe->ActiveCodePane()->TopLine(); }

  AddInEnvironment environment;
  LinkedAddIn addIn;
  std::shared_ptr<host::ComponentImpl> one;
  std::shared_ptr<host::ComponentImpl> two;
};

TEST(Browsing, APlaceLeftAfterTwoSecondsOrLessIsNotRecorded) {
  Browsing ide;
  ide.go(ide.one, 1);
  ide.stay(1200);  // samples at 600 (the first) and 1200
  ide.go(ide.one, 2);
  ide.stay(600);  // the move is seen with 1.8 s spent in Proc1
  EXPECT_EQ(ide.places(), QStringList());
  ide.stay(1800);
  ide.go(ide.one, 3);
  ide.stay(600);  // 2.4 s in Proc2
  EXPECT_EQ(ide.places(), QStringList{u"modUm.Proc2"_qs});
  EXPECT_TRUE(ide.addIn.globals().CommandState()[common::CommandId::BrowseBackward]);
  EXPECT_FALSE(ide.addIn.globals().CommandState()[common::CommandId::BrowseForward]);
}

TEST(Browsing, ScrollingWithinAProcedureOnlyMovesTheCurrentPlacesTopLine) {
  Browsing ide;
  ide.go(ide.one, 1);
  ide.stay(600);
  EXPECT_EQ(ide.histories().CurrentPosition().TopLine, topOf(1));
  ide.addIn.vbe->ActiveCodePane()->setTopLine(topOf(1) + 10);  // the middle line is still in Proc1
  ide.stay(3000);
  EXPECT_EQ(ide.places(), QStringList());
  EXPECT_EQ(ide.histories().CurrentPosition().TopLine, topOf(1) + 10);
  EXPECT_EQ(ide.histories().CurrentPosition().ProcName, u"Proc1"_qs);
  ide.go(ide.two, 1);
  ide.stay(600);
  ASSERT_EQ(ide.places(), QStringList{u"modUm.Proc1"_qs});
  EXPECT_EQ(ide.histories().entry(1).TopLine, topOf(1) + 10);
}

TEST(Browsing, BackAndForwardThroughTheButtons) {
  Browsing ide;
  ide.go(ide.one, 1);
  ide.stay(3000);
  ide.go(ide.two, 2);
  ide.stay(3000);
  ASSERT_EQ(ide.places(), QStringList{u"modUm.Proc1"_qs});
  ide.addIn.clickToolBar(common::CommandId::BrowseBackward);
  EXPECT_EQ(ide.places(), (QStringList{u"modUm.Proc1"_qs, u"modDois.Proc2"_qs}));
  EXPECT_EQ(ide.addIn.vbe->ActiveCodePane()->CodeModule()->Name(), u"modUm"_qs);
  EXPECT_EQ(ide.shownTopLine(), topOf(1));
  // The jump itself is not a visit.
  ide.stay(3000);
  EXPECT_EQ(ide.histories().HistoryCount(), 2);
  EXPECT_EQ(ide.histories().CurrentHistoryIndex(), 1);
  ide.addIn.clickMenu(common::CommandId::BrowseForward);
  EXPECT_EQ(ide.addIn.vbe->ActiveCodePane()->CodeModule()->Name(), u"modDois"_qs);
  EXPECT_EQ(ide.shownTopLine(), topOf(2));
  EXPECT_EQ(ide.histories().CurrentHistoryIndex(), 2);
  EXPECT_FALSE(ide.addIn.globals().CommandState()[common::CommandId::BrowseForward]);
}

TEST(Browsing, MovingElsewhereWhileBrowsingDropsThePlacesAheadAndRecordsNothing) {
  Browsing ide;
  for (int procedure = 1; procedure <= 4; ++procedure) {
    ide.go(ide.one, procedure);
    ide.stay(3000);
  }
  ide.addIn.clickToolBar(common::CommandId::BrowseBackward);
  ide.addIn.clickToolBar(common::CommandId::BrowseBackward);
  ASSERT_EQ(ide.histories().CurrentHistoryIndex(), 2);
  ASSERT_EQ(ide.histories().HistoryCount(), 4);
  ide.stay(3000);
  ide.go(ide.two, 1);
  ide.stay(600);
  EXPECT_EQ(ide.places(), (QStringList{u"modUm.Proc1"_qs, u"modUm.Proc2"_qs}));
  EXPECT_EQ(ide.histories().CurrentHistoryIndex(), 0);
  EXPECT_FALSE(ide.addIn.globals().CommandState()[common::CommandId::BrowseForward]);
}

TEST(Browsing, RemovingAComponentInDesignModeTakesOutItsPlaces) {
  Browsing ide;
  ide.go(ide.two, 1);
  ide.stay(3000);
  ide.go(ide.one, 1);
  ide.stay(3000);
  ide.go(ide.one, 2);
  ide.stay(600);
  ASSERT_EQ(ide.places(), (QStringList{u"modDois.Proc1"_qs, u"modUm.Proc1"_qs}));
  ide.two->Collection()->Remove(ide.two);
  EXPECT_EQ(ide.places(), QStringList{u"modUm.Proc1"_qs});
}

TEST(Browsing, AShortModuleInATallPaneIsStillSampled) {
  Browsing ide;
  auto project = ide.addIn.vbe->projects().front();
  auto small = addModule(project, u"modCurto"_qs, 1, 5);  // 7 lines, the pane shows 40
  showAt(small, 1);
  ide.stay(3000);
  ide.go(ide.one, 1);
  ide.stay(600);
  EXPECT_EQ(ide.places(), QStringList{u"modCurto.Proc1"_qs});
}

TEST(Browsing, NothingIsSampledWhileTheProgramRunsOrTheIdeIsMinimised) {
  Browsing ide;
  ide.go(ide.one, 1);
  ide.stay(3000);
  ide.addIn.vbe->setMode(ide::IdeMode::Run);
  ide.go(ide.one, 2);
  ide.stay(3000);
  EXPECT_EQ(ide.places(), QStringList());
  // Break mode records again.
  ide.addIn.vbe->setMode(ide::IdeMode::Break);
  ide.stay(600);
  EXPECT_EQ(ide.places(), QStringList{u"modUm.Proc1"_qs});

  ide.addIn.vbe->setMode(ide::IdeMode::Design);
  ide.stay(3000);
  ide.addIn.vbe->MainWindow()->setWindowState(ide::WindowState::Minimize);
  ide.go(ide.one, 3);
  ide.stay(3000);
  EXPECT_EQ(ide.places(), QStringList{u"modUm.Proc1"_qs});
  ide.addIn.vbe->MainWindow()->setWindowState(ide::WindowState::Normal);
  ide.stay(600);
  EXPECT_EQ(ide.places(), (QStringList{u"modUm.Proc1"_qs, u"modUm.Proc2"_qs}));
}

}  // namespace
}  // namespace navigation
