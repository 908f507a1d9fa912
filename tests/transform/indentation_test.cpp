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
// indenting it as written changes nothing. The common block shapes are checked on generated modules
// (messy_test.cpp); these are the rules those modules do not reach.
TEST(IndentProcedureBlocks, IndentsEachBlockKind) {
  const char* const procedures[] = {
      // A continued Case line keeps its body level.
      "Sub T()\n   Select Case i\n      Case 1, _\n         2\n         a = 1\n   End Select\nEnd Sub",
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
      // Loop keywords with conditions and comments; the directives' and ElseIf's middles close and reopen.
      R"(Sub T()
   Do ' sempre
      b = i
   Loop Until b > 5
   While c
      c = c - 1
   Wend	' fim (a tab before the comment)
   #If DEBUG Then
      Debug.Print 1
   #ElseIf TESTE Then
      Debug.Print 2
   #Else
      Debug.Print 3
   #End If
   If a Then
      x = 1
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
      {u"x = 1", 0},
      {u"10000", 0},
      {u"10. x", 0},
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

// --- Declarations ---

TEST(IndentDeclarations, IndentsTypesEnumsAndDirectives) {
  const char* const sections[] = {
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

}  // namespace
}  // namespace transform
