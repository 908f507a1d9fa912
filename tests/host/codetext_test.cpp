// SPDX-License-Identifier: MIT
// The code-module engine: procedure extents, members, edits, hidden attributes and Find.
#include "host/code/codetext.h"
#include "ide/error.h"

#include "printers.h"
#include "testproject.h"

#include <gtest/gtest.h>

#include <QStringList>

#include <array>
#include <random>
#include <tuple>

namespace host {
namespace {

using test::errorNumberOf;

std::vector<SourceLine> linesOf(const QStringList& lines) {
  std::vector<SourceLine> result;
  for (const QString& line : lines)
    result.push_back(SourceLine{line, LineEnd::CRLF});
  return result;
}

void loadLines(CodeText& text, const QStringList& lines, std::vector<MemberAttributeLine> attributes = {}) {
  text.load(linesOf(lines), std::move(attributes));
}

// The example of the IDE's documentation of procedure extents.
const QStringList kPropertyModule = {
    u"Option Explicit"_qs,                           // 1
    u"Private m As Long"_qs,                         // 2
    QString(),                                       // 3
    u"' about Foo"_qs,                               // 4
    u"Public Sub Foo()"_qs,                          // 5
    u"    m = 1"_qs,                                 // 6
    u"End Sub"_qs,                                   // 7
    QString(),                                       // 8
    u"Public Property Get Bar() As Long"_qs,         // 9
    u"    Bar = m"_qs,                               // 10
    u"End Property"_qs,                              // 11
    u"Public Property Let Bar(ByVal v As Long)"_qs,  // 12
    u"    m = v"_qs,                                 // 13
    u"End Property"_qs,                              // 14
    QString(),                                       // 15
    u"' trailing note"_qs,                           // 16
};

TEST(ProcedureExtents, FollowTheIdeForPropertiesAndTrailingLinesAndProcOfLineNamesTheOwner) {
  CodeText text;
  loadLines(text, kPropertyModule);
  EXPECT_EQ(text.countOfDeclarationLines(), 2);
  // Name, kind, start, body and count; the last procedure owns the blank and comment lines after its End.
  const std::tuple<const char16_t*, ide::ProcKind, int, int, int> extents[] = {
      {u"Foo", ide::ProcKind::Proc, 3, 5, 5},
      {u"Bar", ide::ProcKind::Get, 8, 9, 4},
      {u"Bar", ide::ProcKind::Let, 12, 12, 5}};
  for (const auto& [name, kind, start, body, count] : extents)
    EXPECT_EQ((std::array{text.procStartLine(name, kind), text.procBodyLine(name, kind),
                          text.procCountLines(name, kind)}),
              (std::array{start, body, count}))
        << QString::fromUtf16(name).toStdString() << int(kind);
  // A line's owner and its kind; the blank above a comment belongs to the first procedure.
  const std::tuple<int, QString, ide::ProcKind> owners[] = {
      {1, {}, ide::ProcKind::Proc},        {3, u"Foo"_qs, ide::ProcKind::Proc},
      {4, u"Foo"_qs, ide::ProcKind::Proc}, {8, u"Bar"_qs, ide::ProcKind::Get},
      {13, u"Bar"_qs, ide::ProcKind::Let}, {16, u"Bar"_qs, ide::ProcKind::Let}};
  for (const auto& [line, name, kind] : owners) {
    ide::ProcKind found = ide::ProcKind::Set;
    EXPECT_EQ(text.procOfLine(line, found), name) << line;
    EXPECT_EQ(found, kind) << line;
  }
  ide::ProcKind kind;
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
    u"Option Explicit"_qs,                                                    // 1
    u"#If Win32 Then"_qs,                                                     // 2
    u"Private Declare Function GetTickCount Lib \"kernel32\" () As Long"_qs,  // 3
    u"#Else"_qs,                                                              // 4
    u"Private Declare Function GetTickCount Lib \"kernel\" () As Long"_qs,    // 5
    u"#End If"_qs,                                                            // 6
    u"Public Declare Sub Sleep Lib \"kernel32\" _"_qs,                        // 7
    u"    (ByVal ms As Long)"_qs,                                             // 8
    u"Private Type Ponto"_qs,                                                 // 9
    u"    X As Long"_qs,                                                      // 10
    u"End Type"_qs,                                                           // 11
    u"Public Enum Cor"_qs,                                                    // 12
    u"    Vermelho = 1"_qs,                                                   // 13
    u"End Enum"_qs,                                                           // 14
    u"Private WithEvents mTimer As Timer"_qs,                                 // 15
    u"Dim a As Long, b(1 To 3) As String ' dois"_qs,                          // 16
    u"Public Const MAXIMO = 10, MINIMO = 1"_qs,                               // 17
    u"Public Event Mudou(ByVal valor As Long)"_qs,                            // 18
    u"' comentário acima do primeiro procedimento"_qs,                        // 19
    QString(),                                                                // 20
    u"Private Static Function Soma( _"_qs,                                    // 21
    u"    ByVal x As Long, _"_qs,                                             // 22
    u"    ByVal y As Long) As Long"_qs,                                       // 23
    u"    Soma = x + y"_qs,                                                   // 24
    u"End Function"_qs,                                                       // 25
};

TEST(ProcedureExtents, ContinuedHeaderAndDeclarationsSection) {
  CodeText text;
  loadLines(text, kDeclarationsModule);
  EXPECT_EQ(text.countOfDeclarationLines(), 18);
  EXPECT_EQ(text.procStartLine(u"Soma", ide::ProcKind::Proc), 19);
  EXPECT_EQ(text.procBodyLine(u"Soma", ide::ProcKind::Proc), 21);
  EXPECT_EQ(text.procCountLines(u"Soma", ide::ProcKind::Proc), 7);
  ide::ProcKind kind;
  EXPECT_EQ(text.procOfLine(22, kind), u"Soma"_qs);
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
  EXPECT_EQ(members[0].name, u"m"_qs);
  EXPECT_EQ(members[1].name, u"Foo"_qs);
  EXPECT_EQ(members[2].name, u"Bar"_qs);
  EXPECT_EQ(members[2].type, ide::MemberType::Property);
  EXPECT_EQ(members[2].line, 8);  // the first procedure line of its first accessor
}

TEST(ModulesWithoutProcedures, DeclarationsEndAtTheLastLineThatIsNotBlank) {
  CodeText text;
  loadLines(text, {u"Option Explicit"_qs, u"Public Total As Long"_qs, u"' fim"_qs, QString(), QString()});
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
  loadLines(text,
            {u"End Sub"_qs, u"Sub A()"_qs, u"End Sub"_qs, u"End Function"_qs, u"Sub B()"_qs, u"x = 1"_qs});
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
  loadLines(text, {u"a"_qs, u"b"_qs, u"c"_qs});
  EXPECT_EQ(text.lines(2, 2), u"b\r\nc"_qs);
  EXPECT_EQ(text.lines(2, 10), u"b\r\nc"_qs);
  EXPECT_EQ(text.lines(4, 1), QString());
  EXPECT_EQ(text.lines(1, 0), QString());
  EXPECT_EQ(errorNumberOf([&] { text.lines(0, 1); }), ide::err::SubscriptOutOfRange);
}

TEST(Editing, InsertLinesSplitsTextAndATrailingLineEndAddsAnEmptyLine) {
  CodeText text;
  loadLines(text, {u"a"_qs, u"d"_qs});
  text.insertLines(2, u"b\r\nc\nx\ry\r\n");
  EXPECT_EQ(text.lines(1, 100), u"a\r\nb\r\nc\r\nx\r\ny\r\n\r\nd"_qs);
  text.insertLines(text.countOfLines() + 1, u"fim");
  EXPECT_EQ(text.line(text.countOfLines()), u"fim"_qs);
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
  EXPECT_EQ(text.lines(1, 4), u"one\r\n2a\r\n2b\r\nthree"_qs);
  EXPECT_EQ(errorNumberOf([&] { text.deleteLines(3, 3); }), ide::err::SubscriptOutOfRange);
  text.deleteLines(2, 2);
  EXPECT_EQ(text.lines(1, 4), u"one\r\nthree"_qs);
}

TEST(Editing, LinesOverTheIdesLimitAreRefusedWithNothingChanged) {
  CodeText text;
  loadLines(text, {u"a"_qs});
  const QString tooLong(kMaxLineLength + 1, u'x');
  EXPECT_EQ(errorNumberOf([&] { text.replaceLine(1, tooLong); }), ide::err::LineTooLong);
  EXPECT_EQ(errorNumberOf([&] { text.insertLines(1, u"ok\r\n"_qs + tooLong); }), ide::err::LineTooLong);
  EXPECT_EQ(text.lines(1, 5), u"a"_qs);
  text.replaceLine(1, QString(kMaxLineLength, u'y'));
  EXPECT_EQ(text.line(1).size(), kMaxLineLength);
}

TEST(Editing, AFileWithoutAFinalLineEndKeepsItWhenLinesAreAppended) {
  CodeText text;
  text.load({SourceLine{u"a"_qs, LineEnd::CRLF}, SourceLine{u"b"_qs, LineEnd::None}}, {});
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
  loadLines(text, {u"a"_qs, u"b"_qs});
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
      u"Public Sub Alfa()"_qs,
      u"Private Function Beta( _"_qs,
      u"    ByVal x As Long) As Long"_qs,
      u"Property Get Gama() As Long"_qs,
      u"Property Let Gama(v As Long)"_qs,
      u"End Sub"_qs,
      u"End Function"_qs,
      u"End Property"_qs,
      u"Dim a As Long"_qs,
      u"Private b As String, c"_qs,
      u"Const K = 1"_qs,
      u"Declare Sub Dorme Lib \"k\" ()"_qs,
      u"Type T"_qs,
      u"End Type"_qs,
      u"' comentário"_qs,
      QString(),
      u"    x = x + 1 _"_qs,
      u"    + 2"_qs,
      u"If a Then"_qs,
      u"Rem nota"_qs,
      u"Event Aviso()"_qs,
      u"Sub Delta(): x = 1"_qs,
      u"Public WithEvents w As C"_qs,
      u"Enum E"_qs,
      u"End Enum"_qs,
      u"    sUB As Long"_qs,
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
      u"Option Explicit"_qs,  u"Dim a As Long"_qs,
      u"Sub Alfa()"_qs,       u"    a = 1"_qs,
      u"End Sub"_qs,          QString(),
      u"Function Beta( _"_qs, u"    ByVal x As Long) As Long"_qs,
      u"    Beta = x"_qs,     u"End Function"_qs,
      u"Sub Gama()"_qs,       u"    a = 2"_qs,
      u"' sem fim"_qs,        u"Property Get Delta() As Long"_qs,
      u"    Delta = a"_qs,    u"End Property"_qs,
      u"Sub Epsilon()"_qs,    u"    a = 3"_qs,
  };
  const QStringList pool = {u"    x = x + 1"_qs, u"' nota"_qs, QString(), u"    If a Then b = 1"_qs,
                            u"    Dim k As Long"_qs};
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
      if (syntax::isStructural(syntax::classify(line).kind) || syntax::continues(line) ||
          (first > 1 && syntax::continues(text.line(first - 1))))
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
    u"Option Explicit"_qs,                                       // 1
    u"Private mItens As Collection"_qs,                          // 2
    u"Public Property Get Item(ByVal i As Long) As Variant"_qs,  // 3
    u"    Item = mItens(i)"_qs,                                  // 4
    u"End Property"_qs,                                          // 5
    u"Public Function Count() As Long"_qs,                       // 6
    u"    Count = mItens.Count"_qs,                              // 7
    u"End Function"_qs,                                          // 8
};

std::vector<MemberAttributeLine> itemIsDefault() {
  return {MemberAttributeLine{3, SourceLine{u"Attribute Item.VB_UserMemId = 0"_qs, LineEnd::CRLF}}};
}

TEST(MemberAttributes, AreKeptWithTheirMemberAndWrittenBackInPlace) {
  CodeText text;
  loadLines(text, kClassCode, itemIsDefault());
  EXPECT_EQ(text.memberAttribute(u"item", u"VB_UserMemId"), u"0"_qs);
  EXPECT_FALSE(text.memberAttribute(u"Count", u"VB_UserMemId"));
  text.insertLines(4, u"    ' novo");
  std::vector<SourceLine> code;
  std::vector<MemberAttributeLine> attributes;
  text.store(code, attributes);
  ASSERT_EQ(attributes.size(), 1u);
  EXPECT_EQ(attributes[0].afterCodeLine, 3);
  EXPECT_EQ(attributes[0].line.text, u"Attribute Item.VB_UserMemId = 0"_qs);
}

TEST(MemberAttributes, CanBeSetChangedAndRemoved) {
  CodeText text;
  loadLines(text, kClassCode, itemIsDefault());
  text.setMemberAttribute(u"Item", u"VB_UserMemId", u"1234"_qs);
  text.setMemberAttribute(u"Count", u"VB_UserMemId", u"0"_qs);
  EXPECT_EQ(text.memberAttribute(u"Item", u"VB_UserMemId"), u"1234"_qs);
  std::vector<SourceLine> code;
  std::vector<MemberAttributeLine> attributes;
  text.store(code, attributes);
  ASSERT_EQ(attributes.size(), 2u);
  EXPECT_EQ(attributes[0].line.text, u"Attribute Item.VB_UserMemId = 1234"_qs);
  EXPECT_EQ(attributes[1].afterCodeLine, 6);
  EXPECT_EQ(attributes[1].line.text, u"Attribute Count.VB_UserMemId = 0"_qs);
  text.setMemberAttribute(u"Item", u"VB_UserMemId", std::nullopt);
  EXPECT_FALSE(text.memberAttribute(u"Item", u"VB_UserMemId"));
  EXPECT_EQ(errorNumberOf([&] { text.setMemberAttribute(u"Nada", u"VB_UserMemId", u"0"_qs); }),
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
  EXPECT_EQ(attributes[0].line.text, u"Attribute Elemento.VB_UserMemId = 0"_qs);

  // Deleting the header and inserting a new one for the same member keeps the member's attribute.
  CodeText rewritten;
  loadLines(rewritten, kClassCode, itemIsDefault());
  rewritten.deleteLines(3, 1);
  rewritten.insertLines(3, u"Public Property Get Item(ByVal i As Long) As String");
  EXPECT_EQ(rewritten.memberAttribute(u"Item", u"VB_UserMemId"), u"0"_qs);
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
    u"Dim Soma As Long, SomaTotal As Long"_qs,   // 1
    u"Sub Calcula()"_qs,                         // 2
    u"    soma = x.Soma + Valor1 + Valor23"_qs,  // 3
    u"    SomaTotal = Soma * 2 ' ação"_qs,       // 4
    u"End Sub"_qs,                               // 5
};
constexpr Range kAll{1, 1, -1, -1};

TEST(Find, PlainTextIgnoresCaseUnlessAskedAndReturnsTheMatch) {
  CodeText text;
  loadLines(text, kFindModule);
  EXPECT_EQ(find(text, u"sub calcula"_qs, kAll), (Range{2, 1, 2, 12}));
  EXPECT_EQ(find(text, u"soma ="_qs, kAll, false, true), (Range{3, 5, 3, 11}));
  EXPECT_EQ(find(text, u"AÇÃO"_qs, kAll), (Range{4, 28, 4, 32}));
  EXPECT_FALSE(find(text, u"AÇÃO"_qs, kAll, false, true));
  EXPECT_FALSE(find(text, QString(), kAll));
}

TEST(Find, WholeWordSkipsLongerWordsButNotMembers) {
  CodeText text;
  loadLines(text, kFindModule);
  EXPECT_EQ(find(text, u"Soma"_qs, Range{1, 6, -1, -1}, true), (Range{3, 5, 3, 9}));
  EXPECT_EQ(find(text, u"Soma"_qs, Range{3, 6, -1, -1}, true), (Range{3, 14, 3, 18}));
  EXPECT_EQ(find(text, u".Soma"_qs, kAll, true), (Range{3, 13, 3, 18}));
  EXPECT_EQ(find(text, u"SomaT"_qs, kAll), (Range{1, 19, 1, 24}));
  EXPECT_FALSE(find(text, u"SomaT"_qs, kAll, true));
}

TEST(Find, TheRangeIsInclusiveOfItsEndColumn) {
  CodeText text;
  loadLines(text, kFindModule);
  // "Calcula" occupies columns 5 to 11 of line 2.
  EXPECT_EQ(find(text, u"Calcula"_qs, Range{1, 1, 2, 11}), (Range{2, 5, 2, 12}));
  EXPECT_FALSE(find(text, u"Calcula"_qs, Range{1, 1, 2, 10}));
  EXPECT_FALSE(find(text, u"End Sub"_qs, Range{1, 1, 4, -1}));
  EXPECT_FALSE(find(text, u"Dim"_qs, Range{1, 2, -1, -1}));
  EXPECT_EQ(errorNumberOf([&] { find(text, u"x"_qs, Range{0, 1, -1, -1}); }), ide::err::InvalidProcedureCall);
}

TEST(Find, PatternsUseTheIdesWildcards) {
  CodeText text;
  loadLines(text, kFindModule);
  // What each wildcard matches is the matcher's; here, that a match becomes the range found.
  EXPECT_EQ(find(text, u"Valor##"_qs, kAll, false, false, true), (Range{3, 30, 3, 37}));
  // Whole word with a pattern: "Soma*" would end inside "SomaTotal" otherwise.
  EXPECT_EQ(find(text, u"Soma"_qs, Range{4, 1, -1, -1}, true, false, true), (Range{4, 17, 4, 21}));
  // Patterns take no case option.
  EXPECT_EQ(errorNumberOf([&] { find(text, u"Soma"_qs, kAll, false, true, true); }),
            ide::err::InvalidProcedureCall);
}

}  // namespace
}  // namespace host
