// SPDX-License-Identifier: MIT
// The number-and-indent command: its scopes, its events and their texts, cancelling, and the progress bar
// it is handed.
#include "transform/numindent.h"
#include "host/model/vbe.h"
#include "host/platform/manualloop.h"
#include "modelfixture.h"
#include "testproject.h"

#include "printers.h"

#include <gtest/gtest.h>

#include <limits>

namespace transform {

using namespace walk;
namespace {

using test::Ide;
using test::kFirst;
using test::kSecond;
using test::linesOf;

const QStringList kFirstDone = {
    u"Option Explicit"_qs, u"Sub Um()"_qs,       u"10000 \tIf x Then"_qs,
    u"10005 \t\ty = 1"_qs, u"10010 \tEnd If"_qs, u"End Sub"_qs,
};
// Records the events of one command in the order they come.
struct Events {
  std::vector<QString> seen;
  std::vector<ide::Connection> connections;
  explicit Events(CNumIndent& command) {
    connections.push_back(command.Begining.connect([this] { seen.push_back(u"Begining"_qs); }));
    connections.push_back(command.Error.connect([this](const QString& text) { seen.push_back(text); }));
    connections.push_back(command.Finished.connect([this] { seen.push_back(u"Finished"_qs); }));
  }
};

struct Scene : test::TwoModules {
  CNumIndent command{ide.vbe};
  Events events{command};
  test::RecordingBar bar;
};

TEST(CNumIndent, NumbersAndIndentsTheSelectedModuleBetweenBeginingAndFinished) {
  Scene s;
  s.select(s.first);
  s.command.DoIt(PROG_MODULE, &s.bar, 10000, 5, false, 1, true);
  EXPECT_EQ(linesOf(*s.first), kFirstDone);
  EXPECT_EQ(linesOf(*s.second), kSecond);
  EXPECT_EQ(s.events.seen, (std::vector<QString>{u"Begining"_qs, u"Finished"_qs}));
  // Lines outside the declarations: five; the procedure advances by all of them.
  EXPECT_EQ(s.bar.maximum(), 5);
  EXPECT_EQ(s.bar.value(), 5);
  EXPECT_TRUE(s.bar.isVisible());
}

TEST(CNumIndent, RemovesNumbersWithSpacesOverTheActiveProject) {
  Scene s;
  s.command.DoIt(PROG_PROJECT, &s.bar, 10000, 5, true, 1, true);
  s.command.DoIt(PROG_PROJECT, &s.bar, 0, 0, true, 3, false);
  EXPECT_EQ(linesOf(*s.first), (QStringList{kFirst[0], kFirst[1], u"   If x Then"_qs, u"      y = 1"_qs,
                                            u"   End If"_qs, kFirst[5]}));
  EXPECT_EQ(linesOf(*s.second), (QStringList{kSecond[0], u"   z = 2"_qs, kSecond[2]}));
}

TEST(CNumIndent, TheProcedureAtTheCaretAloneChangesAndACaretOutsideEveryProcedureChangesNothing) {
  Scene s;
  Ide::placeCaret(s.first, 1);
  s.command.DoIt(PROG_PROCEDURE, &s.bar, 10000, 5, false, 1, true);
  EXPECT_EQ(linesOf(*s.first), kFirst);
  EXPECT_EQ(s.bar.value(), s.bar.maximum()) << "the bar is still filled";
  EXPECT_EQ(s.events.seen.back(), u"Finished"_qs);
  Ide::placeCaret(s.first, 4);
  s.command.DoIt(PROG_PROCEDURE, &s.bar, 10000, 5, false, 1, true);
  EXPECT_EQ(linesOf(*s.first), kFirstDone);
  EXPECT_EQ(linesOf(*s.second), kSecond);
}

TEST(CNumIndent, CancelDuringAProjectRunHidesTheBarAndRaisesNoFinished) {
  Scene s;
  s.command.setYieldInterval({});
  // The first module's procedure moves the bar: the user cancels then, before the second module.
  s.bar.onValue = [&](int value) {
    if (value > 0) s.command.Cancel();
  };
  s.command.DoIt(PROG_PROJECT, &s.bar, 10000, 5, false, 1, true);
  EXPECT_EQ(linesOf(*s.second), kSecond);
  EXPECT_FALSE(s.bar.isVisible());
  EXPECT_EQ(s.events.seen, std::vector<QString>{u"Begining"_qs});
}

TEST(CNumIndent, ACancelFromWorkTheLoopRunsStopsTheWalkBeforeItChangesAnything) {
  Scene s;
  // The first yield of the run lets the IDE's loop run the click on Cancel.
  s.ide.vbe->manualLoop()->post([&] { s.command.Cancel(); });
  s.command.DoIt(PROG_PROJECT, &s.bar, 10000, 5, false, 1, true);
  EXPECT_EQ(linesOf(*s.first), kFirst);
  EXPECT_EQ(linesOf(*s.second), kSecond);
  EXPECT_EQ(s.events.seen, std::vector<QString>{u"Begining"_qs});
}

TEST(CNumIndent, AFailureOfTheRunItselfIsAnErrorEventNamingDoIt) {
  Ide ide;
  CNumIndent command(ide.vbe);
  Events events(command);
  command.DoIt(PROG_MODULE, nullptr, 10000, 5, false, 1, true);  // no component is selected
  ASSERT_EQ(events.seen.size(), 3u);
  EXPECT_EQ(events.seen[1], u"91 %1\nem CNumIndent_DoIt, linha: 0"_qs.arg(
                                ide::standardDescription(ide::err::ObjectVariableNotSet)));
  EXPECT_EQ(events.seen[2], u"Finished"_qs);
}

TEST(CNumIndent, ANumberPastTheLargestStopsTheRunWithOneErrorNamingTheScope) {
  Scene s;
  s.command.DoIt(PROG_PROJECT, &s.bar, std::numeric_limits<qint32>::max(), 1, false, 1, true);
  ASSERT_EQ(s.events.seen.size(), 3u);
  EXPECT_TRUE(s.events.seen[1].startsWith(u"6 "_qs));
  EXPECT_TRUE(s.events.seen[1].endsWith(u"\nem CNumIndent_NumIndentProject, linha: 4"_qs))
      << s.events.seen[1].toStdString();
  // A procedure is written once it is numbered and indented whole: the one that overflowed is left as
  // it was, rather than half numbered and not indented.
  EXPECT_EQ(linesOf(*s.first), kFirst);
  EXPECT_EQ(linesOf(*s.second), kSecond);
}

TEST(CNumIndent, LinesTheIndenterCannotWriteAreErrorEventsAndTheWalkGoesOn) {
  const QString longCode = u"s = \"%1\""_qs.arg(QString(1012, u'a'));
  Ide ide;
  auto module = ide.addModule({u"Private Type T"_qs, u"x As String * 10 ' "_qs + QString(1000, u'c'),
                               u"End Type"_qs, u"Sub Um()"_qs, longCode, u"y = 1"_qs, u"End Sub"_qs});
  ide.vbe->selectComponent(std::dynamic_pointer_cast<host::ComponentImpl>(module->Parent()));
  CNumIndent command(ide.vbe);
  Events events(command);
  command.DoIt(PROG_MODULE, nullptr, 10000, 5, true, 8, false);
  ASSERT_EQ(events.seen.size(), 4u);
  EXPECT_TRUE(events.seen[1].startsWith(u"35020 "_qs));
  EXPECT_TRUE(events.seen[1].endsWith(u"\nIndentLine 5"_qs)) << events.seen[1].toStdString();
  EXPECT_TRUE(events.seen[2].endsWith(u"\nSource:  IndentDeclarationLine, line: 2"_qs))
      << events.seen[2].toStdString();
  EXPECT_EQ(events.seen[3], u"Finished"_qs);
  EXPECT_EQ(module->Lines(6, 1), u"        y = 1"_qs);
}

}  // namespace
}  // namespace transform
