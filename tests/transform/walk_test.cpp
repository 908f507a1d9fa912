// SPDX-License-Identifier: MIT
// The numbering and indentation walks over the IDE model: which lines they visit and change, yielding,
// cancelling, progress, failures, and the current procedure's bounds on the example group.
#include "host/model/vbe.h"
#include "modelfixture.h"
#include "testproject.h"
#include "transform/indentwalk.h"
#include "transform/numberwalk.h"
#include "transform/numindent.h"

#include "printers.h"

#include <gtest/gtest.h>

#include <QMap>
#include <QTemporaryDir>

#include <chrono>
#include <limits>

namespace transform {

using namespace walk;
namespace {

using test::Ide;
using test::linesOf;

// A module with a continued header, blocks, a continued statement, a label, a comment, directives, a
// blank line before End Sub and a comment after the last procedure. Indented carelessly, tabs included.
const QStringList kModule = {
    u"Option Explicit"_qs,                      // 1
    u"Private m As Long"_qs,                    // 2
    QString(),                                  // 3
    u"Public Sub Alpha(ByVal a As Long, _"_qs,  // 4
    u"        ByVal b As Long, _"_qs,           // 5
    u"        ByVal c As Long)"_qs,             // 6
    u"Dim x As Long"_qs,                        // 7
    u"\tx = a + _"_qs,                          // 8
    u"b"_qs,                                    // 9
    u"  Select Case x"_qs,                      // 10
    u"Case 1"_qs,                               // 11
    u"x = 2"_qs,                                // 12
    u"End Select"_qs,                           // 13
    u"If x > 1 Then"_qs,                        // 14
    u"x = 3"_qs,                                // 15
    u"      Else"_qs,                           // 16
    u"x = 4"_qs,                                // 17
    u"End If"_qs,                               // 18
    u"Erro:"_qs,                                // 19
    u"' nota"_qs,                               // 20
    u"#If DEPURACAO Then"_qs,                   // 21
    u"Debug.Print x"_qs,                        // 22
    u"#End If"_qs,                              // 23
    QString(),                                  // 24
    u"End Sub"_qs,                              // 25
    QString(),                                  // 26
    u"Private Function Beta() As Long"_qs,      // 27
    u"    Beta = 1"_qs,                         // 28
    u"End Function"_qs,                         // 29
    u"' fim do módulo"_qs,                      // 30
};

// kModule indented with two spaces.
QStringList indentedModule() {
  QStringList lines = kModule;
  lines[4] = u"  ByVal b As Long, _"_qs;
  lines[5] = u"  ByVal c As Long)"_qs;
  lines[6] = u"  Dim x As Long"_qs;
  lines[7] = u"  x = a + _"_qs;
  lines[8] = u"    b"_qs;
  lines[9] = u"  Select Case x"_qs;
  lines[10] = u"    Case 1"_qs;
  lines[11] = u"      x = 2"_qs;
  lines[12] = u"  End Select"_qs;
  lines[13] = u"  If x > 1 Then"_qs;
  lines[14] = u"    x = 3"_qs;
  lines[15] = u"  Else"_qs;
  lines[16] = u"    x = 4"_qs;
  lines[17] = u"  End If"_qs;
  lines[18] = u"  Erro:"_qs;
  lines[19] = u"  ' nota"_qs;
  lines[20] = u"  #If DEPURACAO Then"_qs;
  lines[21] = u"    Debug.Print x"_qs;
  lines[22] = u"  #End If"_qs;
  lines[27] = u"  Beta = 1"_qs;
  return lines;
}

struct Failures {
  std::vector<WalkFailure> walks;
  std::vector<WalkFailure> lines;
  void attach(WalkContext& context) {
    context.onFailure = [this](const WalkFailure& failure) { walks.push_back(failure); };
    context.onLineSkipped = [this](const WalkFailure& failure) { lines.push_back(failure); };
  }
};

// A context with a counting loop and a recording bar, failures collected.
struct Walk {
  test::CountingLoop loop;
  test::RecordingBar bar;
  WalkContext context{u"frmLinNumbers"_qs, &loop, &bar};
  Failures failures;
  Walk() { failures.attach(context); }
};

// ---------------------------------------------------------------------------------------------------
// Numbering

TEST(NumberingWalk, EachKindOfModuleLineIsNumberedOrLeftAsTheIdeListsIt) {
  const struct {
    const char* what;
    QStringList lines;
    ide::ComponentType type;
    qint32 start;
    bool add;
    std::vector<std::pair<int, QString>> changed;  // index and new text of the lines that change
  } cases[] = {
      // "2 * b" continues a statement: its 2 is an operand. The header's continuation lines are parameters.
      {"continuations keep their leading numbers",
       {u"Function Soma(ByVal a As Long, _"_qs, u"10 ByVal b As Long) As Long"_qs, u"20 Soma = a + _"_qs,
        u"    2 * b"_qs, u"End Function"_qs},
       ide::ComponentType::StdModule,
       10000,
       false,
       {{2, u"Soma = a + _"_qs}}},
      {"a Declare statement listed as a method is never numbered",
       {u"Private Declare Function GetTickCount Lib \"kernel32\" _"_qs, u"    () As Long"_qs, QString(),
        u"Sub Main()"_qs, u"    x = GetTickCount"_qs, u"End Sub"_qs},
       ide::ComponentType::StdModule,
       100,
       true,
       {{4, u"100     x = GetTickCount"_qs}}},
      {"properties are numbered kind by kind",
       {u"Private mNome As String"_qs, u"Public Property Let Nome(ByVal Valor As String)"_qs,
        u"    mNome = Valor"_qs, u"End Property"_qs, u"Public Property Get Nome() As String"_qs,
        u"    Nome = mNome"_qs, u"End Property"_qs},
       ide::ComponentType::ClassModule,
       1,
       true,
       {{2, u"1     mNome = Valor"_qs}, {5, u"1     Nome = mNome"_qs}}},
  };
  for (const auto& c : cases) {
    Ide ide;
    auto module = ide.addModule(c.lines, c.type);
    Walk run;
    NumberingWalk(run.context, c.start, 10).NumberModule(module, c.add);
    QStringList expected = c.lines;
    for (const auto& [index, text] : c.changed)
      expected[index] = text;
    EXPECT_EQ(linesOf(*module), expected) << c.what;
  }
}

TEST(NumberingWalk, TheCurrentProcedureIsTheOneAtTheCaretAndNoOtherLineChanges) {
  Ide ide;
  auto module = ide.addModule(kModule);
  ide.placeCaret(module, 28);  // in Beta
  module->CodePane()->Window()->setWindowState(ide::WindowState::Minimize);
  Walk run;
  NumberingWalk(run.context, 10000, 5).NumberCurrentProcedure(*ide.vbe, true);
  QStringList expected = kModule;
  expected[27] = u"10000     Beta = 1"_qs;
  EXPECT_EQ(linesOf(*module), expected);
  // The user is about to see the procedure change.
  EXPECT_EQ(module->CodePane()->Window()->WindowState(), ide::WindowState::Normal);

  // In the declarations there is no procedure: nothing changes, the bar still moves.
  ide.placeCaret(module, 1);
  run.context.SetProgressRange(1);
  NumberingWalk(run.context, 10000, 5).NumberCurrentProcedure(*ide.vbe, true);
  EXPECT_EQ(linesOf(*module), expected);
  EXPECT_EQ(run.bar.value(), 1);
}

TEST(NumberingWalk, WithoutACodeWindowTheCurrentProcedureFailsWithItsMessage) {
  Ide ide;
  Walk run;
  NumberingWalk(run.context, 10000, 5).NumberCurrentProcedure(*ide.vbe, true);
  ASSERT_EQ(run.failures.walks.size(), 1u);
  EXPECT_EQ(run.failures.walks[0].messageId, 5123);
  EXPECT_EQ(run.failures.walks[0].operation, u"NumberCurrentProcedure"_qs);
  EXPECT_EQ(run.failures.walks[0].error.number(), ide::err::ObjectVariableNotSet);
}

TEST(NumberingWalk, ANumberPastTheLargestStopsTheRunWithTheMessageOfItsScope) {
  const QStringList procedure = {
      u"Sub Um()"_qs, u"a = 1"_qs, u"b = 2"_qs, u"c = 3"_qs, u"d = 4"_qs, u"End Sub"_qs,
  };
  QStringList lines = procedure;
  lines << u"Sub Dois()"_qs << u"e = 5"_qs << u"End Sub"_qs;
  constexpr qint32 kMax = std::numeric_limits<qint32>::max();

  // Module scope: 5122, once, and the second procedure is not reached.
  Ide ide;
  auto module = ide.addModule(lines);
  Walk run;
  NumberingWalk(run.context, kMax - 10, 5).NumberModule(module, true);
  QStringList expected = lines;
  expected[1] = u"2147483637 a = 1"_qs;
  expected[2] = u"2147483642 b = 2"_qs;
  expected[3] = u"2147483647 c = 3"_qs;
  EXPECT_EQ(linesOf(*module), expected);
  ASSERT_EQ(run.failures.walks.size(), 1u);
  const WalkFailure& failure = run.failures.walks[0];
  EXPECT_EQ(failure.messageId, 5122);
  EXPECT_EQ(failure.operation, u"NumberModule"_qs);
  EXPECT_TRUE(failure.stopsRun);
  EXPECT_EQ(failure.line, 5);
  EXPECT_EQ(failure.error.number(), 6);
  EXPECT_EQ(failure.error.source(), u"em frmLinNumbers_NumberModule, linha: 5"_qs);
  EXPECT_TRUE(run.context.stopped());

  // Project scope: 5121, once, and the other module is left as it was.
  Ide project;
  auto first = project.addModule(procedure);
  auto second = project.addModule(procedure);
  Walk projectRun;
  NumberingWalk(projectRun.context, kMax, 1).NumberProject(project.project, true);
  ASSERT_EQ(projectRun.failures.walks.size(), 1u);
  EXPECT_EQ(projectRun.failures.walks[0].messageId, 5121);
  EXPECT_EQ(linesOf(*first)[1], u"2147483647 a = 1"_qs);
  EXPECT_EQ(linesOf(*first)[2], procedure[2]);
  EXPECT_EQ(linesOf(*second), procedure);

  // A member run on its own reports with the procedure message.
  Ide single;
  auto alone = single.addModule(procedure);
  Walk memberRun;
  NumberingWalk(memberRun.context, kMax, 1).NumberMember(alone, alone->Members()->Item(u"Um"_qs), true);
  ASSERT_EQ(memberRun.failures.walks.size(), 1u);
  EXPECT_EQ(memberRun.failures.walks[0].messageId, 5123);
}

// ---------------------------------------------------------------------------------------------------
// Indentation

TEST(IndentationWalk, IndentsProceduresAndLeavesDeclarationsAndTrailingCommentsAtTheMargin) {
  Ide ide;
  auto module = ide.addModule(kModule);
  Walk run;
  IndentationWalk(run.context, IndentMode::Spaces, 2).IndentModule(module);
  EXPECT_EQ(linesOf(*module), indentedModule());
  // The header's continuation lines were re-indented; the procedures are still where they were.
  EXPECT_EQ(module->ProcBodyLine(u"Alpha"_qs, ide::ProcKind::Proc), 4);
  EXPECT_EQ(module->ProcCountLines(u"Alpha"_qs, ide::ProcKind::Proc), 23);
  EXPECT_EQ(module->Members()->Count(), 3);
}

TEST(IndentationWalk, ProgressCountsLinesOutsideTheDeclarations) {
  Ide ide;
  auto module = ide.addModule(kModule);
  ide.vbe->selectComponent(std::dynamic_pointer_cast<host::ComponentImpl>(module->Parent()));
  Walk run;
  EXPECT_EQ(CountUnits(run.context, *ide.vbe, PROG_MODULE, ProgressUnit::Lines), 28);
  EXPECT_EQ(run.bar.maximum(), 28);
  EXPECT_TRUE(run.bar.isVisible());
  IndentationWalk(run.context, IndentMode::Tabs, 1).IndentModule(module);
  // Alpha advances by its 23 lines, Beta by 5; the declarations would pass the end, which stops the bar.
  EXPECT_EQ(run.bar.values, (std::vector<int>{0, 23, 28}));
}

// ---------------------------------------------------------------------------------------------------
// What every walk shares

TEST(Walks, YieldBeforeEveryComponentMemberAndLineOnceTheIntervalHasPassed) {
  // With no interval: one component; three members (m, Alpha, Beta); Alpha's 18 lines from Dim to the
  // blank before End Sub; Beta's one line (the walk stops at the End line, short of the comment after it).
  // Within the interval only the first yield of a run lets the loop run.
  for (const auto& [interval, runs] : {std::pair(std::chrono::milliseconds(0), 1 + 3 + 18 + 1),
                                       std::pair(std::chrono::milliseconds(std::chrono::hours(1)), 1)}) {
    Ide ide;
    ide.addModule(kModule);
    Walk run;
    run.context.setYieldInterval(interval);
    NumberingWalk(run.context, 10000, 5).NumberProject(ide.project, true);
    EXPECT_EQ(run.loop.runs, runs);
  }
}

TEST(Walks, ACancelEndsTheWalkAtTheNextYieldAndHidesTheBar) {
  Ide ide;
  auto first = ide.addModule(kModule);
  auto second = ide.addModule(kModule);
  Walk run;
  run.context.setYieldInterval({});
  run.bar.setVisible(true);
  // Cancelled from work the loop runs, as the Cancel button is: in the yield before Alpha's fifth line
  // (one component, two members, five lines).
  run.loop.onRun = [&](int runs) {
    if (runs == 1 + 2 + 5) run.context.Cancel();
  };
  NumberingWalk(run.context, 10000, 5).NumberProject(ide.project, true);
  // Dim, x = a + _, b, Select Case: four lines walked before the cancel.
  QStringList expected = kModule;
  expected[6] = u"10000 Dim x As Long"_qs;
  expected[7] = u"10005 \tx = a + _"_qs;
  expected[9] = u"10010   Select Case x"_qs;
  EXPECT_EQ(linesOf(*first), expected);
  EXPECT_EQ(linesOf(*second), kModule);
  EXPECT_FALSE(run.bar.isVisible());
  EXPECT_TRUE(run.context.cancelled());
}

TEST(Walks, RelatedDocumentsAreSkippedAndCountNothing) {
  QTemporaryDir dir;
  auto vbe = host::VbeImpl::create();
  auto project = test::openWithRelatedDocument(*vbe, dir.path());
  ASSERT_EQ(project->Count(), 2);
  auto document = project->components()[1];
  ASSERT_EQ(document->Type(), ide::ComponentType::RelatedDocument);
  vbe->setActiveVBProject(project);
  Walk run;
  EXPECT_EQ(CountUnits(run.context, *vbe, PROG_PROJECT, ProgressUnit::Members), 1);
  vbe->selectComponent(document);
  EXPECT_EQ(CountUnits(run.context, *vbe, PROG_MODULE, ProgressUnit::Lines), 0);
  NumberingWalk(run.context, 10, 10).NumberProject(project, true);
  EXPECT_EQ(project->components()[0]->CodeModule()->Lines(2, 1), u"10 x = 1"_qs);
  EXPECT_TRUE(run.failures.walks.empty());
}

// A line the walk would take past the IDE's limit is passed over with a line failure; the walk goes on.
TEST(Walks, ALineThatWouldGrowTooLongIsPassedOverAndTheWalkGoesOn) {
  const QString longLine = u"s = \"%1\""_qs.arg(QString(1015, u'a'));
  ASSERT_EQ(longLine.size(), 1021);
  const struct {
    const char* operation;
    std::function<void(WalkContext&, const ide::Ref<ide::CodeModule>&)> walk;
    const char* next;
  } cases[] = {
      {"NumberLine", [](WalkContext& c, auto& m) { NumberingWalk(c, 10, 10).NumberModule(m, true); },
       "20 t = 1"},
      {"IndentLine",
       [](WalkContext& c, auto& m) { IndentationWalk(c, IndentMode::Spaces, 4).IndentModule(m); },
       "    t = 1"},
  };
  for (const auto& c : cases) {
    Ide ide;
    auto module = ide.addModule({u"Sub Longo()"_qs, longLine, u"t = 1"_qs, u"End Sub"_qs});
    Walk run;
    c.walk(run.context, module);
    EXPECT_EQ(linesOf(*module)[1], longLine) << c.operation;
    EXPECT_EQ(linesOf(*module)[2], QLatin1StringView(c.next)) << c.operation;
    ASSERT_EQ(run.failures.lines.size(), 1u) << c.operation;
    EXPECT_EQ(run.failures.lines[0].operation, QLatin1StringView(c.operation));
    EXPECT_EQ(run.failures.lines[0].line, 2) << c.operation;
    EXPECT_EQ(run.failures.lines[0].error.number(), ide::err::LineTooLong) << c.operation;
    EXPECT_TRUE(run.failures.walks.empty()) << c.operation;
  }
}

// ---------------------------------------------------------------------------------------------------
// Number-and-indent

TEST(NumIndentWalk, AContinuedHeaderSitsInTheNumberColumn) {
  Ide ide;
  auto module = ide.addModule(kModule);
  Walk run;
  NumIndentWalk(run.context, 10000, 5, IndentMode::Tabs, 1, true).NumIndentModule(module);
  const QString column(6, u' ');
  EXPECT_EQ(linesOf(*module).mid(3, 4),
            (QStringList{kModule[3], column + u"\tByVal b As Long, _"_qs, column + u"\tByVal c As Long)"_qs,
                         u"10000 \tDim x As Long"_qs}));
}

// A line the walk would not change is not replaced: running again edits nothing.
TEST(Walks, RunningASecondTimeReplacesNoLine) {
  const std::function<void(WalkContext&, const ide::Ref<ide::CodeModule>&)> walks[] = {
      [](WalkContext& c, auto& m) { IndentationWalk(c, IndentMode::Spaces, 3).IndentModule(m); },
      [](WalkContext& c, auto& m) { IndentationWalk(c, IndentMode::Tabs, 3).IndentModule(m); },
      // Renumbering widens each number's blank and re-indenting takes it away again.
      [](WalkContext& c, auto& m) {
        NumIndentWalk(c, 10000, 5, IndentMode::Tabs, 1, true).NumIndentModule(m);
      },
  };
  for (size_t w = 0; w < std::size(walks); ++w) {
    Ide ide;
    auto module = ide.addModule(kModule);
    Walk run;
    walks[w](run.context, module);
    const QStringList once = linesOf(*module);
    const quint64 edits = Ide::edits(module);
    walks[w](run.context, module);
    EXPECT_EQ(linesOf(*module), once) << "walk " << w;
    EXPECT_EQ(Ide::edits(module), edits) << "walk " << w;
  }
}

// ---------------------------------------------------------------------------------------------------
// Whole projects: the example group

using Texts = QMap<QString, QStringList>;

Texts textsOf(const host::VbeImpl& vbe) {
  Texts texts;
  for (const auto& project : vbe.projects())
    for (const auto& component : project->components())
      if (auto module = component->CodeModule())
        texts.insert(project->Name() + u'.' + component->Name(), linesOf(*module));
  return texts;
}

struct Opened {
  std::shared_ptr<host::VbeImpl> vbe = host::VbeImpl::create();
  WalkContext context{u"test"_qs, nullptr, nullptr};
  explicit Opened(const QString& file) { vbe->open(file); }
  Texts texts() const { return textsOf(*vbe); }
};

TEST(WholeProjects, LinesOutsideTheCurrentProcedureAreNeverTouched) {
  host::test::ExampleCopy copy;
  const auto walks = std::vector<std::function<void(ide::VBE&, WalkContext&)>>{
      [](ide::VBE& vbe, WalkContext& c) { NumberingWalk(c, 10000, 5).NumberCurrentProcedure(vbe, true); },
      [](ide::VBE& vbe, WalkContext& c) {
        IndentationWalk(c, IndentMode::Tabs, 1).IndentCurrentProcedure(vbe);
      },
      [](ide::VBE& vbe, WalkContext& c) {
        NumIndentWalk(c, 10000, 5, IndentMode::Spaces, 2, true).NumIndentCurrentProcedure(vbe, 1);
      },
  };
  for (size_t w = 0; w < walks.size(); ++w) {
    Opened opened(copy.groupFile());
    const Texts before = opened.texts();
    // AdicionarItem's header runs over three lines.
    auto module = opened.vbe->project(u"Loja"_qs)->component(u"clsPedido"_qs)->CodeModule();
    const int body = module->ProcBodyLine(u"AdicionarItem"_qs, ide::ProcKind::Proc);
    const int start = module->ProcStartLine(u"AdicionarItem"_qs, ide::ProcKind::Proc);
    const int count = module->ProcCountLines(u"AdicionarItem"_qs, ide::ProcKind::Proc);
    Ide::placeCaret(module, body + 4);
    walks[w](*opened.vbe, opened.context);
    const Texts after = opened.texts();
    int changed = 0;
    for (auto it = before.cbegin(); it != before.cend(); ++it) {
      const QStringList& lines = after.value(it.key());
      for (qsizetype i = 0; i < it.value().size(); ++i) {
        if (lines[i] == it.value()[i]) continue;
        ++changed;
        EXPECT_EQ(it.key(), u"Loja.clsPedido"_qs) << "walk " << w;
        EXPECT_GT(i + 1, body) << "walk " << w;  // 1-based line after the header line
        EXPECT_LT(i + 1, start + count - 1) << "walk " << w;
      }
    }
    EXPECT_GT(changed, 0) << "walk " << w;
  }
}

}  // namespace
}  // namespace transform
