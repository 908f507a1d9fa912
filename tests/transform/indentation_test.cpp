// SPDX-License-Identifier: MIT
// Indentation: the If rules, the level stack, the number column, and whole procedures and declarations
// sections walked as the indentation and number-and-indent commands walk them.
#include "transform/indentation.h"

#include "printers.h"
#include "procedurewalk.h"

#include <gtest/gtest.h>

namespace transform {
namespace {

QStringList indented(QStringList lines, IndentMode mode = IndentMode::Spaces, qint32 spaces = 3) {
  Indenter indenter(mode, spaces);
  indentProcedure(lines, indenter);
  return lines;
}

QStringList declarationsIndented(QStringList lines, IndentMode mode = IndentMode::Spaces, qint32 spaces = 3) {
  Indenter indenter(mode, spaces);
  indentDeclarations(lines, indenter);
  return lines;
}

// Number (start 10000, interval 5), then indent, procedure by procedure as the one-command route does.
QStringList numberedAndIndented(const QStringList& lines, IndentMode mode, qint32 spaces) {
  return indented(numberProcedure(lines), mode, spaces);
}

// The lines with their leading blanks taken away: what a careless author typed.
QStringList flattened(QStringList lines) {
  for (QString& line : lines) {
    qsizetype blanks = 0;
    while (blanks < line.size() && line[blanks].isSpace())
      ++blanks;
    line.remove(0, blanks);
  }
  return lines;
}

// --- Block If or single-line If ---

TEST(IfRules, IsBlockIfDecidesOnTheCodeBeforeTheComment) {
  const std::pair<const char16_t*, bool> cases[] = {
      {u"If a Then", true},
      {u"If a > 0 Then ' comentário", true},
      {u"If a Then 'c", true},
      {u"If a Then\t' c", true},
      {u"ElseIf b Then", true},
      {u"#If DEBUG Then", true},
      {u"If a = ThenValue Then", true},
      {u"If a > 0 And _", true},  // continued: a block until the header ends
      {u"If a Then x = 1 + _", true},
      {u"If s = \"'\" Then", true},  // quotes inside string literals are not comment marks
      {u"If s = \"x ' Then y\" Then ' nota", true},
      {u"If s = \"a\"\"'\" Then", true},
      {u"If a Then b = 1", false},
      {u"If a Then b = 1 ' nota", false},
      {u"If a Then Exit Sub", false},
      {u"If a ' Then", false},
      {u"If a = ThenValue", false},
      {u"If a Then: b = 1", false},
      {u"If a Then MsgBox \"it's\"", false},
      {u"If a Then s = \"'\"", false},
      {u"If s = \"' Then\" Then b = 1", false},
  };
  for (const auto& [text, block] : cases)
    EXPECT_EQ(IsBlockIf(text), block) << QString::fromUtf16(text).toStdString();
}

TEST(IfRules, IfEndsSingleLineWhenCodeFollowsThenOrThereIsNone) {
  const std::pair<const char16_t*, bool> cases[] = {
      {u"b > 0 Then", false},
      {u"Then", false},
      {u"Then ' nota", false},
      {u"b > 0 Then ' nota", false},
      {u"b Then\t' nota", false},
      {u"s = \"it's\" Then", false},
      {u"b > 0 And _", false},  // itself continued: the header goes on
      {u"b Then c = 1 + _", false},
      {u"b > 0 Then c = 1", true},
      {u"b > 0", true},
      {u"Then c = 1", true},
      {u"b Then c = 1 ' nota", true},
      {u"s = \"Then\"", true},
      {u"b Then MsgBox \"it's\"", true},
  };
  for (const auto& [text, single] : cases)
    EXPECT_EQ(IfEndsSingleLine(text), single) << QString::fromUtf16(text).toStdString();
}

// --- The level stack ---

class IndenterStack : public ::testing::Test {
 protected:
  // Opens a For level and a continued statement inside it: body at 3, For body at 6, continuation at 9.
  void openForAndContinuation() {
    indenter.beginProcedure();
    continued = false;
    QString forLine = u"For i = 1 To 2"_qs;
    QString continuedLine = u"x = 1 + _"_qs;
    indenter.IndentLine(forLine, continued);
    indenter.IndentLine(continuedLine, continued);
  }

  Indenter indenter{IndentMode::Spaces, 3};
  bool continued = false;
};

TEST_F(IndenterStack, OpenersAndContinuationsPushLevels) {
  openForAndContinuation();
  ASSERT_EQ(indenter.stack().size(), 2u);
  EXPECT_EQ(indenter.stack()[0].iType, IT_ABSOLUTE);
  EXPECT_EQ(indenter.stack()[0].Indentation, 6);
  EXPECT_EQ(indenter.stack()[1].iType, IT_RELATIVE);
  EXPECT_EQ(indenter.stack()[1].Indentation, 9);
  EXPECT_EQ(indenter.current().Indentation, 9);
  EXPECT_EQ(indenter.current().iType, 0) << "cleared after every line";
  EXPECT_TRUE(continued);
}

TEST_F(IndenterStack, PopClosesLevelsUpToTheFirstOfTheMask) {
  struct Case {
    std::vector<qint32> masks;
    std::size_t levelsLeft;
    qint32 indentation;
  };
  const std::vector<Case> cases = {
      {{IT_ABSOLUTE}, 0, 3},                // closes the continuation and the block
      {{IT_RELATIVE}, 1, 6},                // stops at the continuation
      {{IT_RELATIVE, IT_RELATIVE}, 0, 3},   // no match: empties the stack
      {{IT_ABSOLUTE | IT_RELATIVE}, 1, 6},  // either bit: one level
      {{IT_ABSOLUTE, IT_ABSOLUTE}, 0, 3},   // nothing left to close: no change
  };
  for (const Case& sample : cases) {
    openForAndContinuation();
    for (qint32 mask : sample.masks)
      indenter.PopBlock(mask);
    EXPECT_EQ(indenter.stack().size(), sample.levelsLeft);
    EXPECT_EQ(indenter.current().Indentation, sample.indentation);
  }
}

TEST_F(IndenterStack, IndentationNeverGoesBelowZero) {
  indenter.beginDeclarations();
  QString typeLine = u"Type T"_qs;
  indenter.IndentDeclarationLine(typeLine, continued);
  EXPECT_EQ(indenter.current().Indentation, 3);
  indenter.PopBlock(IT_ABSOLUTE);
  indenter.PopBlock(IT_ABSOLUTE);
  EXPECT_EQ(indenter.current().Indentation, 0);
}

TEST_F(IndenterStack, ProcedureEndResetsTheLevelsAndIsLeftAlone) {
  indenter.beginProcedure();
  QString ifLine = u"If a Then"_qs;
  QString endLine = u"      End Sub"_qs;
  indenter.IndentLine(ifLine, continued);
  ASSERT_EQ(indenter.current().Indentation, 6);
  EXPECT_FALSE(indenter.IndentLine(endLine, continued));
  EXPECT_EQ(endLine, u"      End Sub"_qs);
  EXPECT_TRUE(indenter.stack().empty());
  EXPECT_EQ(indenter.current().Indentation, 3);
}

TEST_F(IndenterStack, BeginProcedureClearsAPendingHeaderContinuation) {
  indenter.beginProcedure();
  QString ifLine = u"If a And _"_qs;
  indenter.IndentLine(ifLine, continued);
  ASSERT_TRUE(indenter.ifContinued());
  indenter.beginProcedure(u"      "_qs);
  EXPECT_FALSE(indenter.ifContinued());
  EXPECT_TRUE(indenter.stack().empty());
  EXPECT_EQ(indenter.current().Indentation, 3);
  EXPECT_EQ(indenter.numberColumn(), u"      "_qs);
}

TEST(IndenterConstruction, SpaceModeNeedsAtLeastOneSpace) {
  EXPECT_THROW(Indenter(IndentMode::Spaces, 0), ide::Error);
  EXPECT_THROW(Indenter(IndentMode::Spaces, -2), ide::Error);
  EXPECT_EQ(Indenter(IndentMode::Tabs, 0).unit(), 1);
  EXPECT_EQ(Indenter(IndentMode::Spaces, 4).unit(), 4);
}

// --- Blocks in procedures ---

// Each procedure is indented as written (three spaces a level) from a copy with no indentation at all, and
// indenting it as written changes nothing.
TEST(IndentProcedureBlocks, IndentsEachBlockKind) {
  const char* const procedures[] = {
      "Sub Teste()\n   x = 1\n   If x > 0 Then\n      y = 1\n   Else\n      y = 2\n   End If\nEnd Sub",
      // Case lines one unit in and their bodies two; a continued Case line keeps its body level.
      R"(Sub T()
   For i = 1 To 2
      Select Case i
         Case 1, _
            2
            a = 1
         Case Else
            a = 2
      End Select
      b = 1
   Next
End Sub)",
      // A single-line If opens no level, a comment after Then does.
      R"(Sub T()
   If a Then b = 1
   c = 1
   If a Then ' comentário
      d = 1
   End If
   If s = "'" Then
      e = 1
   End If
   If a Then MsgBox "it's"
   f = 1
End Sub)",
      // A continued If header opens a level when it ends in Then, and closes it when a statement follows.
      R"(Sub T()
   If a > 0 And _
      b > 0 Then
      c = 1
   End If
   If a > 0 And _
      b > 0 And _
      c > 0 Then d = 1
   e = 1
End Sub)",
      "Sub T()\n   x = 1 + _\n      2 + _\n      3\n   y = 4\nEnd Sub",
      // The header's continuation lines sit at the body level.
      "Private Sub Foo(ByVal a As Long, _\n   ByVal b As Long, _\n   ByVal c As Long)\n   x = a\nEnd Sub",
      // Look-alike names are ordinary lines.
      R"(Sub T()
   DoEvents
   Nextx = 1
   Elsewhere = 2
   Loops = 3
   Wending = 4
   Formatar x
   Withdraw
   Cases = 5
End Sub)",
      // Loop keywords with conditions, counters and comments.
      R"(Sub T()
   Do While a < 3
      a = a + 1
   Loop
   Do ' sempre
      For i = 1 To 3
         b = i
      Next i
   Loop Until b > 5
   While c
      With obj
         .Nome = 1
      End With
   Wend	' fim (a tab before the comment)
   Do
   Loop
End Sub)",
      // ElseIf and the directives close and reopen their level.
      R"(Sub P()
   #If DEBUG Then
      Debug.Print 1
   #ElseIf TESTE Then
      Debug.Print 2
   #Else
      Debug.Print 3
   #End If
   If a Then
      x = 1
   ElseIf b Then
      y = 1
   Else ' resto
      z = 1
   End If
End Sub)",
      // Unbalanced closers do not leave the body.
      "Sub U()\n   If a Then\n   End If\n   End If\n   Next\n   End Select\n   x = 1\nEnd Sub",
  };
  for (const char* procedure : procedures) {
    const QStringList expected = linesOf(procedure);
    EXPECT_EQ(indented(flattened(expected)), expected);
    EXPECT_EQ(indented(expected), expected);
  }
}

TEST(IndentProcedureBlocks, TabModeWritesOneTabPerLevelWhateverTheSpaceCount) {
  const QStringList expected =
      linesOf("Sub T()\n\tx = 1\n\tIf a Then\n\t\ty = 1 + _\n\t\t\t2\n\tEnd If\nEnd Sub");
  const QStringList input = linesOf("Sub T()\n    x = 1\nIf a Then\ny = 1 + _\n2\n  End If\nEnd Sub");
  EXPECT_EQ(indented(input, IndentMode::Tabs, 1), expected);
  EXPECT_EQ(indented(input, IndentMode::Tabs, 8), expected);
}

// --- The number column ---

TEST(NumberColumn, PrefixFormsAreMeasuredAsTheyAreWritten) {
  const std::pair<const char16_t*, qsizetype> cases[] = {
      {u"10: x", 3},
      {u"10 : x", 3},  // the colon begins the code: an empty statement
      {u"10 ' nota", 3},
      {u"10' nota", 3},
      {u"    10 x", 3},
      {u"1.5 x", 4},
      {u"-10 x", 4},
      // Blanks after the number, tabs too, belong to the indentation.
      {u"10000 \t\tx = 1", 6},
      {u"10000\tx = 1", 6},
      {u"30    \t' nota", 3},
      {u"20:   \tz = 1", 3},
      // The ":" and "'" of a string literal are passed over.
      {u"10 MsgBox \"a:b\" ' nota", 3},
      {u"MsgBox \"10: x\"", 0},
      // No usable number.
      {u"", 0},
      {u"   ", 0},
      {u"x = 1", 0},
      {u"10000", 0},
      {u"10. x", 0},
      {u"10, x", 0},
      {u"Erro: x", 0},
      {u"' 10 x", 0},
  };
  for (const auto& [line, length] : cases)
    EXPECT_EQ(numberPrefixLength(line), length) << QString::fromUtf16(line).toStdString();
}

TEST(NumberColumn, WidestPrefixOfAStatementGivesTheColumn) {
  EXPECT_EQ(NumberColumnWidth(linesOf("10000 x = 1\ny = 2\n10: z = 3")), u"      "_qs);
  EXPECT_EQ(NumberColumnWidth(linesOf("x\ny")), QString());
  // Continuation lines beginning with a number carry an operand, not a label.
  EXPECT_EQ(NumberColumnWidth(linesOf("x = 1 + _\n  200000 + _\n\n300000 * y\nz = 1")), QString());
  EXPECT_EQ(NumberColumnWidth(linesOf("10 x = _\n200000 + 1\n' nota _\n40000 palavras")), u"   "_qs);
}

TEST(NumberColumn, ContinuationLinesBeginningWithANumberAreIndentedAsCode) {
  const QStringList expected = linesOf(R"(Sub T()
10000    x = a + _
            2 * b
10005    For i = 1 To _
            10
10010       y = i
10015    Next
End Sub)");
  const QStringList once = numberedAndIndented(
      linesOf("Sub T()\nx = a + _\n2 * b\nFor i = 1 To _\n10\ny = i\nNext\nEnd Sub"), IndentMode::Spaces, 3);
  EXPECT_EQ(once, expected);
  EXPECT_EQ(numberedAndIndented(once, IndentMode::Spaces, 3), expected);
}

TEST(NumberColumn, NumberedProcedureIsAlignedInASixCharacterColumn) {
  const QStringList expected = linesOf(R"(Sub Foo()
10000    x = 1
10005    If a Then
10010       b = 1
10015    End If
         Erro:
5        y = 1
20:      z = 1
30       ' nota
10020    MsgBox "a:b"
End Sub)");
  const QStringList input = linesOf(
      "Sub Foo()\n10000 x = 1\n10005 If a Then\n10010 b = 1\n10015 End If\nErro:\n5 y = 1\n20: z = 1\n"
      "30 ' nota\n10020 MsgBox \"a:b\"\nEnd Sub");
  EXPECT_EQ(indented(input), expected);
}

TEST(NumberColumn, ColumnIsStableAcrossRunsInTabMode) {
  QStringList lines = linesOf("Sub Foo()\n10000 x = 1\n30   ' nota\ny = 2\nEnd Sub");
  Indenter indenter(IndentMode::Tabs, 1);
  indentProcedure(lines, indenter);
  const QStringList expected = linesOf("Sub Foo()\n10000 \tx = 1\n30    \t' nota\n      \ty = 2\nEnd Sub");
  EXPECT_EQ(lines, expected);
  EXPECT_EQ(indentProcedure(lines, indenter), 0);
  EXPECT_EQ(lines, expected);
  EXPECT_EQ(indenter.numberColumn(), u"      "_qs);
}

// --- Declarations ---

TEST(IndentDeclarations, IndentsTypesEnumsAndDirectives) {
  const char* const sections[] = {
      R"(Option Explicit
Private Type TPonto
   X As Long
   Y As Long
End Type
Public Enum ECor
   Vermelho = 1
   Azul = 2
End Enum
Type TSimples
   A As Integer
End Type
Enum ETamanho
   Pequeno
End Enum
Dim m_x As Long)",
      R"(#If Win32 Then
   Private Declare Function GetTickCount Lib "kernel32" () As Long
#Else
   Private Declare Function Foo Lib "x" _
      (ByVal a As Long) As Long
#End If
Public Const A = 1)",
      // Numbers are not a column; unbalanced closers stay at the margin.
      "End Type\n10 Dim x\nEnd Enum\nDim y",
      // Members named like the block keywords are members, in any letter case.
      R"(Private Type QSStack
   Type As Byte
   sUB As Long
   Enum As Integer
End Type
Public Enum EModo
   Type = 1
End Enum
Dim m_y As Long)",
  };
  for (const char* section : sections) {
    const QStringList expected = linesOf(section);
    EXPECT_EQ(declarationsIndented(flattened(expected)), expected);
    EXPECT_EQ(declarationsIndented(expected), expected);
  }
  EXPECT_EQ(declarationsIndented(linesOf("Private Enum E\n    A\nEnd Enum"), IndentMode::Tabs, 4),
            linesOf("Private Enum E\n\tA\nEnd Enum"));
}

// --- Only changed lines are reported ---

TEST(IndentChanges, OnlyLinesWhoseTextDiffersAreReported) {
  QStringList lines = linesOf("Sub T()\n   a = 1\n\n   b = 2   \n\tc = 3\n    d = 4\n   e = 5\n   \nEnd Sub");
  Indenter indenter(IndentMode::Spaces, 3);
  EXPECT_EQ(indentProcedure(lines, indenter), 3);
  const QStringList expected =
      linesOf("Sub T()\n   a = 1\n\n   b = 2\n   c = 3\n   d = 4\n   e = 5\n   \nEnd Sub");
  EXPECT_EQ(lines, expected);
  EXPECT_EQ(indentProcedure(lines, indenter), 0);
}

TEST(IndentChanges, NumberColumnPaddingIsComparedToo) {
  Indenter indenter(IndentMode::Spaces, 3);
  indenter.beginProcedure(u"      "_qs);
  bool continued = false;
  QString aligned = u"10000    x = 1"_qs;
  QString narrow = u"5 y"_qs;
  QString tabbed = u"      \tz"_qs;
  EXPECT_FALSE(indenter.IndentLine(aligned, continued));
  EXPECT_TRUE(indenter.IndentLine(narrow, continued));
  EXPECT_EQ(narrow, u"5        y"_qs);
  EXPECT_TRUE(indenter.IndentLine(tabbed, continued));
  EXPECT_EQ(tabbed, u"         z"_qs);
}

// --- The number-and-indent route ---

// `pattern` with each "|" made one level in `mode`.
QStringList inMode(const char* pattern, IndentMode mode, qint32 spaces) {
  QString text = QString::fromUtf8(pattern);
  text.replace(u'|', mode == IndentMode::Tabs ? u"\t"_qs : QString(spaces, u' '));
  return text.split(u'\n');
}

const QStringList kCalcular = linesOf(R"(Private Sub Calcular(ByVal n As Long)
    Dim i As Long
    On Error GoTo Erro

    If n > 0 Then
        For i = 1 To n
            Total = Total + _
                i
        Next i
    Else
        Select Case n
            Case 0
                MsgBox "zero"
            Case Else
                MsgBox "negativo"
        End Select
    End If
    ' fim
    Exit Sub
Erro:
    MsgBox Err.Description
End Sub)");

// Numbers in a column of six, then the levels: the numbering dialog's route indents with tabs, the
// indentation dialog's with spaces.
constexpr const char* kCalcularNumbered = R"(Private Sub Calcular(ByVal n As Long)
10000 |Dim i As Long
10005 |On Error GoTo Erro

10010 |If n > 0 Then
10015 ||For i = 1 To n
10020 |||Total = Total + _
      ||||i
10025 ||Next i
10030 |Else
10035 ||Select Case n
      |||Case 0
10040 ||||MsgBox "zero"
      |||Case Else
10045 ||||MsgBox "negativo"
10050 ||End Select
10055 |End If
      |' fim
10060 |Exit Sub
      |Erro:
10065 |MsgBox Err.Description
End Sub)";

TEST(NumberAndIndent, NumbersAlignInAColumnAndRunningAgainChangesNothing) {
  for (const auto& [mode, spaces] : {std::pair(IndentMode::Tabs, 1), std::pair(IndentMode::Spaces, 3)}) {
    const QStringList once = numberedAndIndented(kCalcular, mode, spaces);
    EXPECT_EQ(once, inMode(kCalcularNumbered, mode, spaces));
    EXPECT_EQ(numberedAndIndented(once, mode, spaces), once);
  }
}

TEST(NumberAndIndent, RemovingNumbersThenIndentingLeavesNoColumn) {
  // The numbered layout without its column.
  QStringList expected = inMode(kCalcularNumbered, IndentMode::Spaces, 3);
  for (qsizetype i = 1; i + 1 < expected.size(); ++i)
    expected[i] = expected[i].mid(6);
  const QStringList numbered = numberedAndIndented(kCalcular, IndentMode::Spaces, 3);
  EXPECT_EQ(indented(unnumberProcedure(numbered), IndentMode::Spaces, 3), expected);
}

TEST(NumberAndIndent, RenumberingWithOtherNumbersKeepsTheLayout) {
  const QStringList first = numberedAndIndented(kCalcular, IndentMode::Tabs, 1);
  const QStringList renumbered = indented(numberProcedure(first, 1, 1), IndentMode::Tabs, 1);
  EXPECT_EQ(renumbered[1], u"1  \tDim i As Long"_qs);
  EXPECT_EQ(renumbered[7], u"   \t\t\t\ti"_qs);
  EXPECT_EQ(renumbered[20], u"14 \tMsgBox Err.Description"_qs);
}

}  // namespace
}  // namespace transform
