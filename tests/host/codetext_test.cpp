// SPDX-License-Identifier: MIT
// The code-module engine: procedure extents, members, edits, hidden attributes and Find.
#include "host/code/codetext.h"
#include "ide/error.h"

#include "printers.h"

#include <gtest/gtest.h>

#include <QStringList>

#include <random>

namespace host {
namespace {

std::vector<SourceLine> linesOf(const QStringList& lines) {
  std::vector<SourceLine> result;
  for (const QString& line : lines)
    result.push_back(SourceLine{line, LineEnd::CRLF});
  return result;
}

void loadLines(CodeText& text, const QStringList& lines, std::vector<MemberAttributeLine> attributes = {}) {
  text.load(linesOf(lines), std::move(attributes));
}

long errorNumberOf(const std::function<void()>& action) {
  try {
    action();
  } catch (const ide::Error& error) {
    return error.number();
  }
  return 0;
}

// The example of the IDE's documentation of procedure extents.
const QStringList kPropertyModule = {
    QStringLiteral("Option Explicit"),                           // 1
    QStringLiteral("Private m As Long"),                         // 2
    QString(),                                                   // 3
    QStringLiteral("' about Foo"),                               // 4
    QStringLiteral("Public Sub Foo()"),                          // 5
    QStringLiteral("    m = 1"),                                 // 6
    QStringLiteral("End Sub"),                                   // 7
    QString(),                                                   // 8
    QStringLiteral("Public Property Get Bar() As Long"),         // 9
    QStringLiteral("    Bar = m"),                               // 10
    QStringLiteral("End Property"),                              // 11
    QStringLiteral("Public Property Let Bar(ByVal v As Long)"),  // 12
    QStringLiteral("    m = v"),                                 // 13
    QStringLiteral("End Property"),                              // 14
    QString(),                                                   // 15
    QStringLiteral("' trailing note"),                           // 16
};

TEST(ProcedureExtents, FollowTheIdeForPropertiesAndTrailingLines) {
  CodeText text;
  loadLines(text, kPropertyModule);
  EXPECT_EQ(text.countOfDeclarationLines(), 2);
  EXPECT_EQ(text.procStartLine(u"Foo", ide::ProcKind::Proc), 3);
  EXPECT_EQ(text.procBodyLine(u"Foo", ide::ProcKind::Proc), 5);
  EXPECT_EQ(text.procCountLines(u"Foo", ide::ProcKind::Proc), 5);
  EXPECT_EQ(text.procStartLine(u"Bar", ide::ProcKind::Get), 8);
  EXPECT_EQ(text.procBodyLine(u"Bar", ide::ProcKind::Get), 9);
  EXPECT_EQ(text.procCountLines(u"Bar", ide::ProcKind::Get), 4);
  EXPECT_EQ(text.procStartLine(u"Bar", ide::ProcKind::Let), 12);
  EXPECT_EQ(text.procBodyLine(u"Bar", ide::ProcKind::Let), 12);
  // The last procedure owns the blank and comment lines after its End line.
  EXPECT_EQ(text.procCountLines(u"Bar", ide::ProcKind::Let), 5);
}

TEST(ProcedureExtents, ProcOfLineAnswersWithTheOwnerAndItsKind) {
  CodeText text;
  loadLines(text, kPropertyModule);
  ide::ProcKind kind = ide::ProcKind::Get;
  EXPECT_EQ(text.procOfLine(1, kind), QString());
  EXPECT_EQ(kind, ide::ProcKind::Proc);
  EXPECT_EQ(text.procOfLine(3, kind), QStringLiteral("Foo"));  // blank above the comment: first procedure
  EXPECT_EQ(text.procOfLine(4, kind), QStringLiteral("Foo"));
  EXPECT_EQ(kind, ide::ProcKind::Proc);
  EXPECT_EQ(text.procOfLine(8, kind), QStringLiteral("Bar"));
  EXPECT_EQ(kind, ide::ProcKind::Get);
  EXPECT_EQ(text.procOfLine(13, kind), QStringLiteral("Bar"));
  EXPECT_EQ(kind, ide::ProcKind::Let);
  EXPECT_EQ(text.procOfLine(16, kind), QStringLiteral("Bar"));
  EXPECT_EQ(kind, ide::ProcKind::Let);
  EXPECT_EQ(errorNumberOf([&] { text.procOfLine(17, kind); }), ide::err::SubscriptOutOfRange);
}

TEST(ProcedureExtents, MissingNameOrKindIsError35AndNamesIgnoreCase) {
  CodeText text;
  loadLines(text, kPropertyModule);
  EXPECT_EQ(errorNumberOf([&] { text.procStartLine(u"Bar", ide::ProcKind::Set); }), 35);
  EXPECT_EQ(errorNumberOf([&] { text.procBodyLine(u"Foo", ide::ProcKind::Get); }), 35);
  EXPECT_EQ(errorNumberOf([&] { text.procCountLines(u"Nothing", ide::ProcKind::Proc); }), 35);
  EXPECT_EQ(text.procBodyLine(u"fOO", ide::ProcKind::Proc), 5);
}

const QStringList kDeclarationsModule = {
    QStringLiteral("Option Explicit"),                                                    // 1
    QStringLiteral("#If Win32 Then"),                                                     // 2
    QStringLiteral("Private Declare Function GetTickCount Lib \"kernel32\" () As Long"),  // 3
    QStringLiteral("#Else"),                                                              // 4
    QStringLiteral("Private Declare Function GetTickCount Lib \"kernel\" () As Long"),    // 5
    QStringLiteral("#End If"),                                                            // 6
    QStringLiteral("Public Declare Sub Sleep Lib \"kernel32\" _"),                        // 7
    QStringLiteral("    (ByVal ms As Long)"),                                             // 8
    QStringLiteral("Private Type Ponto"),                                                 // 9
    QStringLiteral("    X As Long"),                                                      // 10
    QStringLiteral("End Type"),                                                           // 11
    QStringLiteral("Public Enum Cor"),                                                    // 12
    QStringLiteral("    Vermelho = 1"),                                                   // 13
    QStringLiteral("End Enum"),                                                           // 14
    QStringLiteral("Private WithEvents mTimer As Timer"),                                 // 15
    QStringLiteral("Dim a As Long, b(1 To 3) As String ' dois"),                          // 16
    QStringLiteral("Public Const MAXIMO = 10, MINIMO = 1"),                               // 17
    QStringLiteral("Public Event Mudou(ByVal valor As Long)"),                            // 18
    QStringLiteral("' comentário acima do primeiro procedimento"),                        // 19
    QString(),                                                                            // 20
    QStringLiteral("Private Static Function Soma( _"),                                    // 21
    QStringLiteral("    ByVal x As Long, _"),                                             // 22
    QStringLiteral("    ByVal y As Long) As Long"),                                       // 23
    QStringLiteral("    Soma = x + y"),                                                   // 24
    QStringLiteral("End Function"),                                                       // 25
};

TEST(ProcedureExtents, ContinuedHeaderAndDeclarationsSection) {
  CodeText text;
  loadLines(text, kDeclarationsModule);
  EXPECT_EQ(text.countOfDeclarationLines(), 18);
  EXPECT_EQ(text.procStartLine(u"Soma", ide::ProcKind::Proc), 19);
  EXPECT_EQ(text.procBodyLine(u"Soma", ide::ProcKind::Proc), 21);
  EXPECT_EQ(text.procCountLines(u"Soma", ide::ProcKind::Proc), 7);
  ide::ProcKind kind;
  EXPECT_EQ(text.procOfLine(22, kind), QStringLiteral("Soma"));
  EXPECT_EQ(text.procOfLine(7, kind), QString());
  ASSERT_EQ(text.procedures().size(), 1u);
  EXPECT_EQ(text.procedures()[0].headerEnd, 23);
  EXPECT_TRUE(text.procedures()[0].isStatic);
  EXPECT_EQ(text.procedures()[0].scope, ide::Scope::Private);
}

TEST(ProcedureExtents, DeclareStatementsAreAnsweredWhereTheyStand) {
  CodeText text;
  loadLines(text, kDeclarationsModule);
  // They stand in the declarations section, so walks that skip procedures starting there skip them.
  EXPECT_EQ(text.procStartLine(u"Sleep", ide::ProcKind::Proc), 7);
  EXPECT_EQ(text.procBodyLine(u"Sleep", ide::ProcKind::Proc), 7);
  EXPECT_EQ(text.procCountLines(u"Sleep", ide::ProcKind::Proc), 2);
  EXPECT_LE(text.procStartLine(u"GetTickCount", ide::ProcKind::Proc), text.countOfDeclarationLines());
}

TEST(Members, ListsDeclarationsOncePerNameInOrder) {
  CodeText text;
  loadLines(text, kDeclarationsModule);
  struct Expected {
    const char* name;
    ide::MemberType type;
    ide::Scope scope;
  };
  const Expected expected[] = {
      {"GetTickCount", ide::MemberType::Method, ide::Scope::Private},
      {"Sleep", ide::MemberType::Method, ide::Scope::Public},
      {"mTimer", ide::MemberType::Variable, ide::Scope::Private},
      {"a", ide::MemberType::Variable, ide::Scope::Private},
      {"b", ide::MemberType::Variable, ide::Scope::Private},
      {"MAXIMO", ide::MemberType::Const, ide::Scope::Public},
      {"MINIMO", ide::MemberType::Const, ide::Scope::Public},
      {"Mudou", ide::MemberType::Event, ide::Scope::Public},
      {"Soma", ide::MemberType::Method, ide::Scope::Private},
  };
  const auto& members = text.members();
  ASSERT_EQ(members.size(), std::size(expected));
  for (size_t i = 0; i < members.size(); ++i) {
    SCOPED_TRACE(expected[i].name);
    EXPECT_EQ(members[i].name, QLatin1StringView(expected[i].name));
    EXPECT_EQ(members[i].type, expected[i].type);
    EXPECT_EQ(members[i].scope, expected[i].scope);
  }
}

TEST(Members, OnePerPropertyWhateverItsAccessors) {
  CodeText text;
  loadLines(text, kPropertyModule);
  const auto& members = text.members();
  ASSERT_EQ(members.size(), 3u);
  EXPECT_EQ(members[0].name, QStringLiteral("m"));
  EXPECT_EQ(members[1].name, QStringLiteral("Foo"));
  EXPECT_EQ(members[2].name, QStringLiteral("Bar"));
  EXPECT_EQ(members[2].type, ide::MemberType::Property);
  EXPECT_EQ(members[2].line, 8);  // the first procedure line of its first accessor
}

TEST(ModulesWithoutProcedures, DeclarationsEndAtTheLastLineThatIsNotBlank) {
  CodeText text;
  loadLines(text, {QStringLiteral("Option Explicit"), QStringLiteral("Public Total As Long"),
                   QStringLiteral("' fim"), QString(), QString()});
  EXPECT_EQ(text.countOfDeclarationLines(), 3);
  ide::ProcKind kind;
  EXPECT_EQ(text.procOfLine(5, kind), QString());
  ASSERT_EQ(text.members().size(), 1u);

  CodeText empty;
  loadLines(empty, {});
  EXPECT_EQ(empty.countOfLines(), 0);
  EXPECT_EQ(empty.countOfDeclarationLines(), 0);
  EXPECT_TRUE(empty.members().empty());
}

TEST(ModulesWithoutProcedures, StrayEndLinesCloseNothing) {
  CodeText text;
  loadLines(text, {QStringLiteral("End Sub"), QStringLiteral("Sub A()"), QStringLiteral("End Sub"),
                   QStringLiteral("End Function"), QStringLiteral("Sub B()"), QStringLiteral("x = 1")});
  EXPECT_EQ(text.countOfDeclarationLines(), 1);
  EXPECT_EQ(text.procCountLines(u"A", ide::ProcKind::Proc), 2);
  // B has no End line: it runs to the end of the module.
  EXPECT_EQ(text.procStartLine(u"B", ide::ProcKind::Proc), 4);
  EXPECT_EQ(text.procCountLines(u"B", ide::ProcKind::Proc), 3);
}

// Members of Type and Enum blocks and variables may carry keyword names in any letter case: only a name
// after Sub, Function or Property Get/Let/Set starts a procedure, and a block's lines up to its End are its
// members whatever they look like. Each row: a module, its procedures (name@header line), its
// declarations count and its members.
TEST(ProcedureExtents, KeywordLikeNamesStartNoProcedure) {
  const struct {
    const char16_t* module;
    const char* procedures;
    int declarationLines;
    const char* members;
  } cases[] = {
      {uR"(Option Explicit
Private Type QSStack ' pilha da ordenação
    sUB As Long
    FUNCTION(1 To 2) As Integer
    property As String
    Type As Byte
    Sub Fantasma() ' parece cabeçalho
End Type
Public Enum eTipo
    Sub = 1
    function
    End Sub
End Enum
Private sUB As Long, Function(3) As Long
Public Sub Ordena(v() As Long)
    Dim SUB As QSStack, Property As Long
End Sub
Private Property Get Topo() As Long
End Property)",
       "Ordena@15 Topo@18", 14, "sUB Function Ordena Topo"},
      // A block being typed, without its End line, cannot hide the procedures below it.
      {u"Private Type tNovo\n    Sub As Long\nSub Main()\nEnd Sub", "Main@3", 2, "Main"},
  };
  for (const auto& c : cases) {
    CodeText text;
    loadLines(text, QString::fromUtf16(c.module).split(u'\n'));
    QStringList procedures;
    for (const ProcInfo& proc : text.procedures())
      procedures << proc.name + u'@' + QString::number(proc.bodyLine);
    QStringList members;
    for (const MemberInfo& member : text.members())
      members << member.name;
    EXPECT_EQ(procedures.join(u' '), QLatin1StringView(c.procedures));
    EXPECT_EQ(text.countOfDeclarationLines(), c.declarationLines);
    EXPECT_EQ(members.join(u' '), QLatin1StringView(c.members));
  }
}

// ---------------------------------------------------------------------------------------------------
// Editing

TEST(Editing, LinesJoinWithCrLfAndClampAtTheEnd) {
  CodeText text;
  loadLines(text, {QStringLiteral("a"), QStringLiteral("b"), QStringLiteral("c")});
  EXPECT_EQ(text.lines(2, 2), QStringLiteral("b\r\nc"));
  EXPECT_EQ(text.lines(2, 10), QStringLiteral("b\r\nc"));
  EXPECT_EQ(text.lines(4, 1), QString());
  EXPECT_EQ(text.lines(1, 0), QString());
  EXPECT_EQ(errorNumberOf([&] { text.lines(0, 1); }), ide::err::SubscriptOutOfRange);
}

TEST(Editing, InsertLinesSplitsTextAndATrailingLineEndAddsAnEmptyLine) {
  CodeText text;
  loadLines(text, {QStringLiteral("a"), QStringLiteral("d")});
  text.insertLines(2, u"b\r\nc\nx\ry\r\n");
  EXPECT_EQ(text.lines(1, 100), QStringLiteral("a\r\nb\r\nc\r\nx\r\ny\r\n\r\nd"));
  text.insertLines(text.countOfLines() + 1, u"fim");
  EXPECT_EQ(text.line(text.countOfLines()), QStringLiteral("fim"));
  EXPECT_EQ(errorNumberOf([&] { text.insertLines(text.countOfLines() + 2, u"x"); }),
            ide::err::SubscriptOutOfRange);
  EXPECT_EQ(errorNumberOf([&] { text.insertLines(0, u"x"); }), ide::err::SubscriptOutOfRange);
}

TEST(Editing, ReplaceAndDeleteCheckTheirLines) {
  CodeText text;
  loadLines(text, {});
  EXPECT_EQ(errorNumberOf([&] { text.replaceLine(1, u"x"); }), ide::err::SubscriptOutOfRange);
  text.addFromString(u"one\r\ntwo\r\nthree");
  EXPECT_EQ(text.countOfLines(), 3);
  text.replaceLine(2, u"2a\r\n2b");
  EXPECT_EQ(text.lines(1, 4), QStringLiteral("one\r\n2a\r\n2b\r\nthree"));
  EXPECT_EQ(errorNumberOf([&] { text.deleteLines(3, 3); }), ide::err::SubscriptOutOfRange);
  text.deleteLines(2, 2);
  EXPECT_EQ(text.lines(1, 4), QStringLiteral("one\r\nthree"));
}

TEST(Editing, LinesOverTheIdesLimitAreRefusedWithNothingChanged) {
  CodeText text;
  loadLines(text, {QStringLiteral("a")});
  const QString tooLong(kMaxLineLength + 1, u'x');
  EXPECT_EQ(errorNumberOf([&] { text.replaceLine(1, tooLong); }), ide::err::LineTooLong);
  EXPECT_EQ(errorNumberOf([&] { text.insertLines(1, QStringLiteral("ok\r\n") + tooLong); }),
            ide::err::LineTooLong);
  EXPECT_EQ(text.lines(1, 5), QStringLiteral("a"));
  text.replaceLine(1, QString(kMaxLineLength, u'y'));
  EXPECT_EQ(text.line(1).size(), kMaxLineLength);
}

TEST(Editing, AFileWithoutAFinalLineEndKeepsItWhenLinesAreAppended) {
  CodeText text;
  text.load({SourceLine{QStringLiteral("a"), LineEnd::CRLF}, SourceLine{QStringLiteral("b"), LineEnd::None}},
            {});
  text.insertLines(3, u"c");
  std::vector<SourceLine> code;
  std::vector<MemberAttributeLine> attributes;
  text.store(code, attributes);
  ASSERT_EQ(code.size(), 3u);
  EXPECT_EQ(code[1].end, LineEnd::CRLF);
  EXPECT_EQ(code[2].end, LineEnd::None);
  text.deleteLines(3, 1);
  text.store(code, attributes);
  EXPECT_EQ(code.back().end, LineEnd::None);
}

TEST(Editing, ChangeCountGrowsWithEveryEditAndListenersHearOfIt) {
  struct Recorder : CodeText::Listener {
    std::vector<std::tuple<int, int, int>> calls;
    void linesChanged(int first, int removed, int inserted) override {
      calls.emplace_back(first, removed, inserted);
    }
  } recorder;
  CodeText text;
  loadLines(text, {QStringLiteral("a"), QStringLiteral("b")});
  text.addListener(&recorder);
  const quint64 before = text.changeCount();
  text.replaceLine(2, u"B");
  text.insertLines(1, u"x\r\ny");
  text.deleteLines(2, 1);
  text.removeListener(&recorder);
  text.replaceLine(1, u"z");
  EXPECT_EQ(text.changeCount(), before + 4);
  const std::vector<std::tuple<int, int, int>> expected = {{2, 1, 1}, {1, 0, 2}, {2, 1, 0}};
  EXPECT_EQ(recorder.calls, expected);
}

// The index after any sequence of edits answers as an index built from scratch over the same text.
void expectSameAnswers(CodeText& edited) {
  CodeText fresh;
  QStringList lines;
  for (int n = 1; n <= edited.countOfLines(); ++n)
    lines << edited.line(n);
  loadLines(fresh, lines);
  ASSERT_EQ(edited.countOfDeclarationLines(), fresh.countOfDeclarationLines());
  const auto& a = edited.procedures();
  const auto& b = fresh.procedures();
  ASSERT_EQ(a.size(), b.size());
  for (size_t i = 0; i < a.size(); ++i) {
    EXPECT_EQ(a[i].name, b[i].name);
    EXPECT_EQ(a[i].kind, b[i].kind);
    EXPECT_EQ(a[i].bodyLine, b[i].bodyLine);
    EXPECT_EQ(a[i].headerEnd, b[i].headerEnd);
    EXPECT_EQ(a[i].endLine, b[i].endLine);
  }
  for (const ProcInfo& proc : b) {
    EXPECT_EQ(edited.procStartLine(proc.name, proc.kind), fresh.procStartLine(proc.name, proc.kind));
    EXPECT_EQ(edited.procCountLines(proc.name, proc.kind), fresh.procCountLines(proc.name, proc.kind));
  }
  for (int n = 1; n <= fresh.countOfLines(); ++n) {
    ide::ProcKind k1, k2;
    ASSERT_EQ(edited.procOfLine(n, k1), fresh.procOfLine(n, k2)) << "line " << n;
    ASSERT_EQ(k1, k2) << "line " << n;
  }
  const auto& m1 = edited.members();
  const auto& m2 = fresh.members();
  ASSERT_EQ(m1.size(), m2.size());
  for (size_t i = 0; i < m1.size(); ++i) {
    EXPECT_EQ(m1[i].name, m2[i].name);
    EXPECT_EQ(m1[i].type, m2[i].type);
    EXPECT_EQ(m1[i].line, m2[i].line);
  }
}

TEST(Editing, TheIndexStaysRightAfterEveryKindOfEdit) {
  // Lines that make and unmake structure: headers (also continued ones), End lines, declarations, Type and
  // Enum blocks, comments, blanks, continuation marks, and ordinary statements.
  const QStringList pool = {
      QStringLiteral("Public Sub Alfa()"),
      QStringLiteral("Private Function Beta( _"),
      QStringLiteral("    ByVal x As Long) As Long"),
      QStringLiteral("Property Get Gama() As Long"),
      QStringLiteral("Property Let Gama(v As Long)"),
      QStringLiteral("End Sub"),
      QStringLiteral("End Function"),
      QStringLiteral("End Property"),
      QStringLiteral("Dim a As Long"),
      QStringLiteral("Private b As String, c"),
      QStringLiteral("Const K = 1"),
      QStringLiteral("Declare Sub Dorme Lib \"k\" ()"),
      QStringLiteral("Type T"),
      QStringLiteral("End Type"),
      QStringLiteral("' comentário"),
      QString(),
      QStringLiteral("    x = x + 1 _"),
      QStringLiteral("    + 2"),
      QStringLiteral("If a Then"),
      QStringLiteral("Rem nota"),
      QStringLiteral("Event Aviso()"),
      QStringLiteral("Sub Delta(): x = 1"),
      QStringLiteral("Public WithEvents w As C"),
      QStringLiteral("Enum E"),
      QStringLiteral("End Enum"),
      QStringLiteral("    sUB As Long"),
  };
  std::mt19937 random(20261206);
  auto pick = [&] { return pool[static_cast<int>(random() % static_cast<unsigned>(pool.size()))]; };
  CodeText text;
  loadLines(text, kPropertyModule);
  for (int step = 0; step < 1500; ++step) {
    const int count = text.countOfLines();
    const unsigned op = random() % 5;
    if (op == 0 || count == 0) {
      text.insertLines(1 + static_cast<int>(random() % static_cast<unsigned>(count + 1)),
                       pick() + "\r\n" + pick());
    } else if (op == 1 && count > 3) {
      const int first = 1 + static_cast<int>(random() % static_cast<unsigned>(count));
      text.deleteLines(first, std::min(1 + static_cast<int>(random() % 3), count - first + 1));
    } else if (op == 2) {
      text.replaceLine(1 + static_cast<int>(random() % static_cast<unsigned>(count)), pick() + "\n" + pick());
    } else {
      text.replaceLine(1 + static_cast<int>(random() % static_cast<unsigned>(count)), pick());
    }
    if (step % 10 == 0) {
      SCOPED_TRACE(step);
      expectSameAnswers(text);
      if (HasFatalFailure()) return;
    }
  }
  expectSameAnswers(text);
}

TEST(Editing, TheIndexFollowsLinesAddedAndRemovedInsideProcedures) {
  // Ordinary lines only, so that the index moves procedures instead of reading their headers again; the
  // module has a continued header and procedures without End lines, in the middle and at the end.
  const QStringList module = {
      QStringLiteral("Option Explicit"),  QStringLiteral("Dim a As Long"),
      QStringLiteral("Sub Alfa()"),       QStringLiteral("    a = 1"),
      QStringLiteral("End Sub"),          QString(),
      QStringLiteral("Function Beta( _"), QStringLiteral("    ByVal x As Long) As Long"),
      QStringLiteral("    Beta = x"),     QStringLiteral("End Function"),
      QStringLiteral("Sub Gama()"),       QStringLiteral("    a = 2"),
      QStringLiteral("' sem fim"),        QStringLiteral("Property Get Delta() As Long"),
      QStringLiteral("    Delta = a"),    QStringLiteral("End Property"),
      QStringLiteral("Sub Epsilon()"),    QStringLiteral("    a = 3"),
  };
  const QStringList pool = {QStringLiteral("    x = x + 1"), QStringLiteral("' nota"), QString(),
                            QStringLiteral("    If a Then b = 1"), QStringLiteral("    Dim k As Long")};
  std::mt19937 random(7);
  auto pick = [&] { return pool[static_cast<int>(random() % static_cast<unsigned>(pool.size()))]; };
  CodeText text;
  loadLines(text, module);
  for (int step = 0; step < 600; ++step) {
    const int count = text.countOfLines();
    // Below the declarations: the lines above the first header are the declarations' business.
    const int low = 4;
    if (random() % 2 == 0 || count < 25) {
      const int at = low + static_cast<int>(random() % static_cast<unsigned>(count - low + 2));
      text.insertLines(at, random() % 3 == 0 ? pick() + "\r\n" + pick() : pick());
    } else {
      const int first = low + static_cast<int>(random() % static_cast<unsigned>(count - low + 1));
      const QString line = text.line(first);
      const LineClass cls = classifyStatement(line);
      if (isStructural(cls) || continuesOnNextLine(line) ||
          (first > 1 && continuesOnNextLine(text.line(first - 1))))
        continue;  // keep the structure: this test is about lines that come and go around it
      text.deleteLines(first, 1);
    }
    SCOPED_TRACE(step);
    expectSameAnswers(text);
    if (HasFatalFailure()) return;
  }
}

// ---------------------------------------------------------------------------------------------------
// Hidden member attributes

const QStringList kClassCode = {
    QStringLiteral("Option Explicit"),                                       // 1
    QStringLiteral("Private mItens As Collection"),                          // 2
    QStringLiteral("Public Property Get Item(ByVal i As Long) As Variant"),  // 3
    QStringLiteral("    Item = mItens(i)"),                                  // 4
    QStringLiteral("End Property"),                                          // 5
    QStringLiteral("Public Function Count() As Long"),                       // 6
    QStringLiteral("    Count = mItens.Count"),                              // 7
    QStringLiteral("End Function"),                                          // 8
};

std::vector<MemberAttributeLine> itemIsDefault() {
  return {
      MemberAttributeLine{3, SourceLine{QStringLiteral("Attribute Item.VB_UserMemId = 0"), LineEnd::CRLF}}};
}

TEST(MemberAttributes, AreKeptWithTheirMemberAndWrittenBackInPlace) {
  CodeText text;
  loadLines(text, kClassCode, itemIsDefault());
  EXPECT_EQ(text.memberAttribute(u"item", u"VB_UserMemId"), QStringLiteral("0"));
  EXPECT_FALSE(text.memberAttribute(u"Count", u"VB_UserMemId"));
  text.insertLines(4, u"    ' novo");
  std::vector<SourceLine> code;
  std::vector<MemberAttributeLine> attributes;
  text.store(code, attributes);
  ASSERT_EQ(attributes.size(), 1u);
  EXPECT_EQ(attributes[0].afterCodeLine, 3);
  EXPECT_EQ(attributes[0].line.text, QStringLiteral("Attribute Item.VB_UserMemId = 0"));
}

TEST(MemberAttributes, CanBeSetChangedAndRemoved) {
  CodeText text;
  loadLines(text, kClassCode, itemIsDefault());
  text.setMemberAttribute(u"Item", u"VB_UserMemId", QStringLiteral("1234"));
  text.setMemberAttribute(u"Count", u"VB_UserMemId", QStringLiteral("0"));
  EXPECT_EQ(text.memberAttribute(u"Item", u"VB_UserMemId"), QStringLiteral("1234"));
  std::vector<SourceLine> code;
  std::vector<MemberAttributeLine> attributes;
  text.store(code, attributes);
  ASSERT_EQ(attributes.size(), 2u);
  EXPECT_EQ(attributes[0].line.text, QStringLiteral("Attribute Item.VB_UserMemId = 1234"));
  EXPECT_EQ(attributes[1].afterCodeLine, 6);
  EXPECT_EQ(attributes[1].line.text, QStringLiteral("Attribute Count.VB_UserMemId = 0"));
  text.setMemberAttribute(u"Item", u"VB_UserMemId", std::nullopt);
  EXPECT_FALSE(text.memberAttribute(u"Item", u"VB_UserMemId"));
  EXPECT_EQ(errorNumberOf([&] { text.setMemberAttribute(u"Nada", u"VB_UserMemId", QStringLiteral("0")); }),
            ide::err::SubscriptOutOfRange);
}

TEST(MemberAttributes, FollowARenamedHeaderAndARewrittenOne) {
  CodeText text;
  loadLines(text, kClassCode, itemIsDefault());
  text.replaceLine(3, u"Public Property Get Elemento(ByVal i As Long) As Variant");
  std::vector<SourceLine> code;
  std::vector<MemberAttributeLine> attributes;
  text.store(code, attributes);
  ASSERT_EQ(attributes.size(), 1u);
  EXPECT_EQ(attributes[0].line.text, QStringLiteral("Attribute Elemento.VB_UserMemId = 0"));

  // Deleting the header and inserting a new one for the same member keeps the member's attribute.
  CodeText rewritten;
  loadLines(rewritten, kClassCode, itemIsDefault());
  rewritten.deleteLines(3, 1);
  rewritten.insertLines(3, u"Public Property Get Item(ByVal i As Long) As String");
  EXPECT_EQ(rewritten.memberAttribute(u"Item", u"VB_UserMemId"), QStringLiteral("0"));
  rewritten.store(code, attributes);
  ASSERT_EQ(attributes.size(), 1u);
  EXPECT_EQ(attributes[0].afterCodeLine, 3);

  // A member that is gone takes its attributes with it.
  CodeText removed;
  loadLines(removed, kClassCode, itemIsDefault());
  removed.deleteLines(3, 3);
  removed.store(code, attributes);
  EXPECT_TRUE(attributes.empty());
}

// ---------------------------------------------------------------------------------------------------
// Find

struct Range {
  int startLine, startColumn, endLine, endColumn;
  bool operator==(const Range&) const = default;
};

std::optional<Range> find(CodeText& text, const QString& target, Range in, bool wholeWord = false,
                          bool matchCase = false, bool pattern = false) {
  if (!text.find(target, in.startLine, in.startColumn, in.endLine, in.endColumn, wholeWord, matchCase,
                 pattern))
    return std::nullopt;
  return in;
}

const QStringList kFindModule = {
    QStringLiteral("Dim Soma As Long, SomaTotal As Long"),   // 1
    QStringLiteral("Sub Calcula()"),                         // 2
    QStringLiteral("    soma = x.Soma + Valor1 + Valor23"),  // 3
    QStringLiteral("    SomaTotal = Soma * 2 ' ação"),       // 4
    QStringLiteral("End Sub"),                               // 5
};
constexpr Range kAll{1, 1, -1, -1};

TEST(Find, PlainTextIgnoresCaseUnlessAskedAndReturnsTheMatch) {
  CodeText text;
  loadLines(text, kFindModule);
  EXPECT_EQ(find(text, QStringLiteral("sub calcula"), kAll), (Range{2, 1, 2, 12}));
  EXPECT_EQ(find(text, QStringLiteral("soma ="), kAll, false, true), (Range{3, 5, 3, 11}));
  EXPECT_EQ(find(text, QStringLiteral("AÇÃO"), kAll), (Range{4, 28, 4, 32}));
  EXPECT_FALSE(find(text, QStringLiteral("AÇÃO"), kAll, false, true));
  EXPECT_FALSE(find(text, QString(), kAll));
}

TEST(Find, WholeWordSkipsLongerWordsButNotMembers) {
  CodeText text;
  loadLines(text, kFindModule);
  EXPECT_EQ(find(text, QStringLiteral("Soma"), Range{1, 6, -1, -1}, true), (Range{3, 5, 3, 9}));
  EXPECT_EQ(find(text, QStringLiteral("Soma"), Range{3, 6, -1, -1}, true), (Range{3, 14, 3, 18}));
  EXPECT_EQ(find(text, QStringLiteral(".Soma"), kAll, true), (Range{3, 13, 3, 18}));
  EXPECT_EQ(find(text, QStringLiteral("SomaT"), kAll), (Range{1, 19, 1, 24}));
  EXPECT_FALSE(find(text, QStringLiteral("SomaT"), kAll, true));
}

TEST(Find, TheRangeIsInclusiveOfItsEndColumn) {
  CodeText text;
  loadLines(text, kFindModule);
  // "Calcula" occupies columns 5 to 11 of line 2.
  EXPECT_EQ(find(text, QStringLiteral("Calcula"), Range{1, 1, 2, 11}), (Range{2, 5, 2, 12}));
  EXPECT_FALSE(find(text, QStringLiteral("Calcula"), Range{1, 1, 2, 10}));
  EXPECT_FALSE(find(text, QStringLiteral("End Sub"), Range{1, 1, 4, -1}));
  EXPECT_FALSE(find(text, QStringLiteral("Dim"), Range{1, 2, -1, -1}));
  EXPECT_EQ(errorNumberOf([&] {
              find(text, QStringLiteral("x"), Range{0, 1, -1, -1});
            }),
            ide::err::InvalidProcedureCall);
}

TEST(Find, PatternsUseTheIdesWildcards) {
  CodeText text;
  loadLines(text, kFindModule);
  EXPECT_EQ(find(text, QStringLiteral("Valor#"), kAll, false, false, true), (Range{3, 21, 3, 27}));
  EXPECT_EQ(find(text, QStringLiteral("Valor##"), kAll, false, false, true), (Range{3, 30, 3, 37}));
  EXPECT_EQ(find(text, QStringLiteral("s?ma"), kAll, false, false, true), (Range{1, 5, 1, 9}));
  // "*" takes the longest run on the line.
  EXPECT_EQ(find(text, QStringLiteral("Dim*Long"), kAll, false, false, true), (Range{1, 1, 1, 36}));
  EXPECT_EQ(find(text, QStringLiteral("[a-c]alcula"), kAll, false, false, true), (Range{2, 5, 2, 12}));
  EXPECT_EQ(find(text, QStringLiteral("Valor[!1]"), kAll, false, false, true), (Range{3, 30, 3, 36}));
  EXPECT_EQ(find(text, QStringLiteral("x[.,]Soma"), kAll, false, false, true), (Range{3, 12, 3, 18}));
  // Whole word with a pattern: "Soma*" would end inside "SomaTotal" otherwise.
  EXPECT_EQ(find(text, QStringLiteral("Soma"), Range{4, 1, -1, -1}, true, false, true),
            (Range{4, 17, 4, 21}));
}

TEST(Find, PatternErrors) {
  CodeText text;
  loadLines(text, kFindModule);
  EXPECT_EQ(errorNumberOf([&] { find(text, QStringLiteral("[abc"), kAll, false, false, true); }), 93);
  EXPECT_EQ(errorNumberOf([&] { find(text, QStringLiteral("[z-a]"), kAll, false, false, true); }), 93);
  EXPECT_EQ(errorNumberOf([&] { find(text, QStringLiteral("Soma"), kAll, false, true, true); }),
            ide::err::InvalidProcedureCall);
}

}  // namespace
}  // namespace host
