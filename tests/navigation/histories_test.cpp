// SPDX-License-Identifier: MIT
// CHistories on its own: the ten places, clearing, browsing and the back and forward entries.
#include "navigation/histories.h"
#include "addinfixture.h"
#include "host/model/objects.h"

#include <gtest/gtest.h>

namespace navigation {
namespace {

using addin::test::addModule;
using addin::test::showAt;

struct HistoryIde {
  HistoryIde() {
    auto project = vbe->newProject();
    one = addModule(project, u"modUm"_qs, 12, 50);
    two = addModule(project, u"modDois"_qs, 2, 50);
  }
  /// Makes the place at `topLine` of `component` the current position and records it.
  void record(const std::shared_ptr<host::ComponentImpl>& component, int topLine, const QString& proc) {
    setCurrent(component, topLine, proc);
    histories.AddHistory();
  }
  void setCurrent(const std::shared_ptr<host::ComponentImpl>& component, int topLine, const QString& proc) {
    HISTORY_ENTRY& current = histories.CurrentPosition();
    current = HISTORY_ENTRY();
    current.CodeModule = component->CodeModule();
    current.ProcName = proc;
    current.TopLine = topLine;
  }
  bool back() const { return state[common::CommandId::BrowseBackward]; }
  bool forward() const { return state[common::CommandId::BrowseForward]; }
  int shownTopLine() { return vbe->ActiveCodePane()->TopLine(); }
  QString shownModule() { return vbe->ActiveCodePane()->CodeModule()->Name(); }

  std::shared_ptr<host::VbeImpl> vbe = host::VbeImpl::create();
  common::CommandState state;
  CHistories histories{*vbe, state};
  std::shared_ptr<host::ComponentImpl> one;
  std::shared_ptr<host::ComponentImpl> two;
};

TEST(CHistories, TheEleventhPlaceDropsTheOldest) {
  HistoryIde ide;
  for (int i = 1; i <= 11; ++i)
    ide.record(ide.one, 50 * i - 47, u"Proc%1"_qs.arg(i));
  EXPECT_EQ(ide.histories.HistoryCount(), 10);
  EXPECT_EQ(ide.histories.entry(1).ProcName, u"Proc2"_qs);
  EXPECT_EQ(ide.histories.entry(10).ProcName, u"Proc11"_qs);
  EXPECT_TRUE(ide.back());
  EXPECT_FALSE(ide.forward());
  ide.histories.SetTopLineOfLastHistory(7);
  EXPECT_EQ(ide.histories.entry(10).TopLine, 7);
}

TEST(CHistories, BackFromThePresentRecordsItSoThatForwardReturns) {
  HistoryIde ide;
  ide.record(ide.one, 3, u"Proc1"_qs);
  ide.record(ide.one, 53, u"Proc2"_qs);
  ide.setCurrent(ide.two, 60, u"Proc2"_qs);

  ide.histories.Browse(BD_BACKWARD);
  EXPECT_EQ(ide.histories.HistoryCount(), 3);
  EXPECT_EQ(ide.histories.CurrentHistoryIndex(), 2);
  EXPECT_EQ(ide.shownModule(), u"modUm"_qs);
  EXPECT_EQ(ide.shownTopLine(), 53);
  EXPECT_TRUE(ide.back());
  EXPECT_TRUE(ide.forward());
  EXPECT_EQ(ide.histories.CurrentPosition().ProcName, u"Proc2"_qs) << "the shown place is the current one";

  ide.histories.Browse(BD_BACKWARD);
  EXPECT_EQ(ide.histories.CurrentHistoryIndex(), 1);
  EXPECT_EQ(ide.shownTopLine(), 3);
  EXPECT_FALSE(ide.back());
  ide.histories.Browse(BD_BACKWARD);
  EXPECT_EQ(ide.histories.CurrentHistoryIndex(), 1) << "nothing before the first place";

  ide.histories.Browse(BD_FORWARD);
  ide.histories.Browse(BD_FORWARD);
  EXPECT_EQ(ide.histories.CurrentHistoryIndex(), 3);
  EXPECT_EQ(ide.shownModule(), u"modDois"_qs);
  EXPECT_EQ(ide.shownTopLine(), 60);
  // The caret is put at the start of the shown top line.
  int sl = 0, sc = 0, el = 0, ec = 0;
  ide.vbe->ActiveCodePane()->GetSelection(sl, sc, el, ec);
  EXPECT_EQ(QList<int>({sl, sc, el, ec}), QList<int>({60, 1, 60, 1}));
  EXPECT_FALSE(ide.forward());
  EXPECT_TRUE(ide.back());
  ide.histories.Browse(BD_FORWARD);
  EXPECT_EQ(ide.histories.CurrentHistoryIndex(), 3);
}

TEST(CHistories, BrowsingAnEmptyHistoryOrForwardFromThePresentDoesNothing) {
  HistoryIde ide;
  ide.histories.Browse(BD_BACKWARD);
  EXPECT_EQ(ide.histories.HistoryCount(), 0);
  EXPECT_EQ(ide.vbe->ActiveCodePane(), nullptr);
  ide.record(ide.one, 3, u"Proc1"_qs);
  ide.state.set(common::CommandId::BrowseForward, true);
  ide.histories.Browse(BD_FORWARD);
  EXPECT_FALSE(ide.forward());
  EXPECT_EQ(ide.histories.CurrentHistoryIndex(), 0);
  EXPECT_EQ(ide.vbe->ActiveCodePane(), nullptr);
}

TEST(CHistories, BackWithoutAKnownPresentShowsTheNewestPlaceAndAddsNoEmptyOne) {
  HistoryIde ide;
  ide.record(ide.one, 3, u"Proc1"_qs);
  ide.record(ide.one, 53, u"Proc2"_qs);
  ide.histories.CurrentPosition() = HISTORY_ENTRY();
  ide.histories.Browse(BD_BACKWARD);
  EXPECT_EQ(ide.histories.HistoryCount(), 2);
  EXPECT_EQ(ide.histories.CurrentHistoryIndex(), 2);
  EXPECT_EQ(ide.shownTopLine(), 53);
  EXPECT_FALSE(ide.forward());
  ide.histories.Browse(BD_FORWARD);
  EXPECT_EQ(ide.histories.HistoryCount(), 2) << "the history survives going forward";
  ide.histories.Browse(BD_BACKWARD);
  EXPECT_EQ(ide.shownTopLine(), 3);
}

TEST(CHistories, ClearingForwardKeepsThePlacesUpToTheShownOne) {
  HistoryIde ide;
  for (int i = 1; i <= 4; ++i)
    ide.record(ide.one, 50 * i - 47, u"Proc%1"_qs.arg(i));
  ide.setCurrent(ide.two, 3, u"Proc1"_qs);
  ide.histories.ClearHistories(CA_FORWARD);
  EXPECT_EQ(ide.histories.HistoryCount(), 4) << "not browsing: nothing to clear";
  ide.histories.Browse(BD_BACKWARD);
  ide.histories.Browse(BD_BACKWARD);
  ASSERT_EQ(ide.histories.CurrentHistoryIndex(), 3);
  ide.histories.ClearHistories(CA_FORWARD);
  EXPECT_EQ(ide.histories.HistoryCount(), 3);
  EXPECT_EQ(ide.histories.CurrentHistoryIndex(), 0);
  EXPECT_TRUE(ide.back());
  EXPECT_FALSE(ide.forward());

  ide.histories.ClearHistories(CA_TOTAL);
  EXPECT_EQ(ide.histories.HistoryCount(), 0);
  EXPECT_FALSE(ide.back());
  EXPECT_EQ(ide.histories.CurrentPosition().CodeModule, nullptr);
}

TEST(CHistories, GoingToAPlaceWhoseComponentWasRemovedEmptiesTheHistory) {
  HistoryIde ide;
  ide.record(ide.two, 3, u"Proc1"_qs);
  ide.setCurrent(ide.one, 3, u"Proc1"_qs);
  ide.two->Collection()->Remove(ide.two);
  ide.histories.Browse(BD_BACKWARD);
  EXPECT_EQ(ide.histories.HistoryCount(), 0);
  EXPECT_EQ(ide.histories.CurrentHistoryIndex(), 0);
  EXPECT_FALSE(ide.back());
  EXPECT_FALSE(ide.forward());
}

TEST(CHistories, RemovingAComponentTakesOutItsPlaces) {
  HistoryIde ide;
  ide.record(ide.one, 3, u"A"_qs);
  ide.record(ide.two, 3, u"B"_qs);
  ide.record(ide.one, 53, u"C"_qs);
  ide.record(ide.two, 53, u"D"_qs);
  ide.record(ide.one, 103, u"E"_qs);
  ide.setCurrent(ide.one, 153, u"F"_qs);
  ide.histories.Browse(BD_BACKWARD);  // adds F, shows E (index 5)
  ide.histories.Browse(BD_BACKWARD);  // shows D (index 4)
  ASSERT_EQ(ide.histories.CurrentHistoryIndex(), 4);

  ide.histories.RemoveHistoriesOfComponent(ide.two);
  // B (at 2) and D (at 4, the shown one) were at or before the index: it moved down twice.
  EXPECT_EQ(ide.histories.HistoryCount(), 4);
  QStringList names;
  for (int i = 1; i <= ide.histories.HistoryCount(); ++i)
    names << ide.histories.entry(i).ProcName;
  EXPECT_EQ(names, (QStringList{u"A"_qs, u"C"_qs, u"E"_qs, u"F"_qs}));
  EXPECT_EQ(ide.histories.CurrentHistoryIndex(), 2);
  EXPECT_EQ(ide.histories.CurrentPosition().ProcName, u"C"_qs);

  // The current place's own module: the position is forgotten and browsing stops.
  ide.histories.RemoveHistoriesOfComponent(ide.one);
  EXPECT_EQ(ide.histories.HistoryCount(), 0);
  EXPECT_EQ(ide.histories.CurrentHistoryIndex(), 0);
  EXPECT_EQ(ide.histories.CurrentPosition().CodeModule, nullptr);
  EXPECT_FALSE(ide.back());
  EXPECT_FALSE(ide.forward());
  ide.histories.RemoveHistoriesOfComponent(nullptr);
}

}  // namespace
}  // namespace navigation
