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

// --- CIndenter ---

TEST(CIndenterRecord, CopyIsIndependent) {
  CIndenter level{IT_RELATIVE, 6};
  CIndenter copy = level.Copy();
  level.Indentation = 9;
  level.iType = IT_ABSOLUTE;
  EXPECT_EQ(copy.iType, IT_RELATIVE);
  EXPECT_EQ(copy.Indentation, 6);
}

TEST(CIndenterRecord, TypeBitsHaveTheirPublicValues) {
  EXPECT_EQ(IT_ABSOLUTE, 1);
  EXPECT_EQ(IT_RELATIVE, 2);
  EXPECT_EQ(IT_META, 4);
  EXPECT_EQ(IT_IFLINE, 8);
  EXPECT_EQ(IT_CASELINE, 16);
}

// --- Block If or single-line If ---

TEST(IsBlockIfRule, ThenAtTheEndOrBeforeACommentOpensABlock) {
  for (const char16_t* t : {u"If a Then", u"If a > 0 Then ' comentário", u"If a Then 'c", u"If a Then\t' c",
                            u"ElseIf b Then", u"#If DEBUG Then", u"If a = ThenValue Then"}) {
    EXPECT_TRUE(IsBlockIf(t)) << QString::fromUtf16(t).toStdString();
  }
}

TEST(IsBlockIfRule, ContinuedHeaderIsTreatedAsABlockUntilItEnds) {
  EXPECT_TRUE(IsBlockIf(u"If a > 0 And _"));
  EXPECT_TRUE(IsBlockIf(u"If a Then x = 1 + _"));
}

TEST(IsBlockIfRule, StatementAfterThenMakesASingleLineIf) {
  for (const char16_t* t : {u"If a Then b = 1", u"If a Then b = 1 ' nota", u"If a Then Exit Sub",
                            u"If a ' Then", u"If a = ThenValue", u"If a Then: b = 1"}) {
    EXPECT_FALSE(IsBlockIf(t)) << QString::fromUtf16(t).toStdString();
  }
}

TEST(IsBlockIfRule, QuotesInsideStringLiteralsAreNotCommentMarks) {
  EXPECT_TRUE(IsBlockIf(u"If s = \"'\" Then"));
  EXPECT_TRUE(IsBlockIf(u"If s = \"x ' Then y\" Then ' nota"));
  EXPECT_TRUE(IsBlockIf(u"If s = \"a\"\"'\" Then"));
  EXPECT_FALSE(IsBlockIf(u"If a Then MsgBox \"it's\""));
  EXPECT_FALSE(IsBlockIf(u"If a Then s = \"'\""));
  EXPECT_FALSE(IsBlockIf(u"If s = \"' Then\" Then b = 1"));
}

TEST(IfEndsSingleLineRule, ThenAtTheEndKeepsTheBlock) {
  for (const char16_t* t : {u"b > 0 Then", u"Then", u"Then ' nota", u"b > 0 Then ' nota", u"b Then\t' nota",
                            u"s = \"it's\" Then"}) {
    EXPECT_FALSE(IfEndsSingleLine(t)) << QString::fromUtf16(t).toStdString();
  }
}

TEST(IfEndsSingleLineRule, CodeAfterThenOrNoThenEndsASingleLineIf) {
  for (const char16_t* t : {u"b > 0 Then c = 1", u"b > 0", u"Then c = 1", u"b Then c = 1 ' nota",
                            u"s = \"Then\"", u"b Then MsgBox \"it's\""}) {
    EXPECT_TRUE(IfEndsSingleLine(t)) << QString::fromUtf16(t).toStdString();
  }
}

TEST(IfEndsSingleLineRule, LineThatIsItselfContinuedDoesNotEndTheHeader) {
  EXPECT_FALSE(IfEndsSingleLine(u"b > 0 And _"));
  EXPECT_FALSE(IfEndsSingleLine(u"b Then c = 1 + _"));
}

// --- The level stack ---

class IndenterStack : public ::testing::Test {
 protected:
  // Opens a For level and a continued statement inside it: body at 3, For body at 6, continuation at 9.
  void openForAndContinuation() {
    indenter.beginProcedure();
    QString forLine = QStringLiteral("For i = 1 To 2");
    QString continuedLine = QStringLiteral("x = 1 + _");
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
  EXPECT_TRUE(continued);
}

TEST_F(IndenterStack, CurrentTypeIsClearedAfterEveryLine) {
  openForAndContinuation();
  EXPECT_EQ(indenter.current().iType, 0);
}

TEST_F(IndenterStack, PopAbsoluteClosesTheContinuationAndTheBlock) {
  openForAndContinuation();
  indenter.PopBlock(IT_ABSOLUTE);
  EXPECT_TRUE(indenter.stack().empty());
  EXPECT_EQ(indenter.current().Indentation, 3);
}

TEST_F(IndenterStack, PopRelativeStopsAtTheContinuation) {
  openForAndContinuation();
  indenter.PopBlock(IT_RELATIVE);
  ASSERT_EQ(indenter.stack().size(), 1u);
  EXPECT_EQ(indenter.stack()[0].iType, IT_ABSOLUTE);
  EXPECT_EQ(indenter.current().Indentation, 6);
}

TEST_F(IndenterStack, PopWithoutAMatchEmptiesTheStack) {
  openForAndContinuation();
  indenter.PopBlock(IT_RELATIVE);
  indenter.PopBlock(IT_RELATIVE);
  EXPECT_TRUE(indenter.stack().empty());
  EXPECT_EQ(indenter.current().Indentation, 3);
}

TEST_F(IndenterStack, MaskWithBothBitsClosesOneLevel) {
  openForAndContinuation();
  indenter.PopBlock(IT_ABSOLUTE | IT_RELATIVE);
  EXPECT_EQ(indenter.stack().size(), 1u);
  EXPECT_EQ(indenter.current().Indentation, 6);
}

TEST_F(IndenterStack, PopOnAnEmptyStackChangesNothing) {
  indenter.beginProcedure();
  indenter.PopBlock(IT_ABSOLUTE);
  EXPECT_TRUE(indenter.stack().empty());
  EXPECT_EQ(indenter.current().Indentation, 3);
}

TEST_F(IndenterStack, IndentationNeverGoesBelowZero) {
  indenter.beginDeclarations();
  QString typeLine = QStringLiteral("Type T");
  indenter.IndentDeclarationLine(typeLine, continued);
  EXPECT_EQ(indenter.current().Indentation, 3);
  indenter.PopBlock(IT_ABSOLUTE);
  indenter.PopBlock(IT_ABSOLUTE);
  EXPECT_EQ(indenter.current().Indentation, 0);
}

TEST_F(IndenterStack, ProcedureEndResetsTheLevelsAndIsLeftAlone) {
  indenter.beginProcedure();
  QString ifLine = QStringLiteral("If a Then");
  QString endLine = QStringLiteral("      End Sub");
  indenter.IndentLine(ifLine, continued);
  ASSERT_EQ(indenter.current().Indentation, 6);
  EXPECT_FALSE(indenter.IndentLine(endLine, continued));
  EXPECT_EQ(endLine, QStringLiteral("      End Sub"));
  EXPECT_TRUE(indenter.stack().empty());
  EXPECT_EQ(indenter.current().Indentation, 3);
}

TEST_F(IndenterStack, BeginProcedureClearsAPendingHeaderContinuation) {
  indenter.beginProcedure();
  QString ifLine = QStringLiteral("If a And _");
  indenter.IndentLine(ifLine, continued);
  ASSERT_TRUE(indenter.ifContinued());
  indenter.beginProcedure(QStringLiteral("      "));
  EXPECT_FALSE(indenter.ifContinued());
  EXPECT_TRUE(indenter.stack().empty());
  EXPECT_EQ(indenter.current().Indentation, 3);
  EXPECT_EQ(indenter.numberColumn(), QStringLiteral("      "));
}

TEST(IndenterConstruction, SpaceModeNeedsAtLeastOneSpace) {
  EXPECT_THROW(Indenter(IndentMode::Spaces, 0), ide::Error);
  EXPECT_THROW(Indenter(IndentMode::Spaces, -2), ide::Error);
  EXPECT_EQ(Indenter(IndentMode::Tabs, 0).unit(), 1);
  EXPECT_EQ(Indenter(IndentMode::Spaces, 4).unit(), 4);
}

// --- Blocks in procedures ---

TEST(IndentProcedureBlocks, BlockIfWithThreeSpaces) {
  const QStringList expected = {
      QStringLiteral("Sub Teste()"), QStringLiteral("   x = 1"), QStringLiteral("   If x > 0 Then"),
      QStringLiteral("      y = 1"), QStringLiteral("   Else"),  QStringLiteral("      y = 2"),
      QStringLiteral("   End If"),   QStringLiteral("End Sub"),
  };
  EXPECT_EQ(indented({QStringLiteral("Sub Teste()"), QStringLiteral("x = 1"), QStringLiteral("If x > 0 Then"),
                      QStringLiteral("y = 1"), QStringLiteral("Else"), QStringLiteral("y = 2"),
                      QStringLiteral("End If"), QStringLiteral("End Sub")}),
            expected);
}

TEST(IndentProcedureBlocks, SelectCaseLinesOneUnitInAndBodiesTwo) {
  const QStringList expected = {
      QStringLiteral("Sub T()"),
      QStringLiteral("   For i = 1 To 2"),
      QStringLiteral("      Select Case i"),
      QStringLiteral("         Case 1"),
      QStringLiteral("            a = 1"),
      QStringLiteral("         Case Else"),
      QStringLiteral("            a = 2"),
      QStringLiteral("      End Select"),
      QStringLiteral("      b = 1"),
      QStringLiteral("   Next"),
      QStringLiteral("End Sub"),
  };
  EXPECT_EQ(indented({QStringLiteral("Sub T()"), QStringLiteral("For i = 1 To 2"),
                      QStringLiteral("Select Case i"), QStringLiteral("Case 1"), QStringLiteral("a = 1"),
                      QStringLiteral("Case Else"), QStringLiteral("a = 2"), QStringLiteral("End Select"),
                      QStringLiteral("b = 1"), QStringLiteral("Next"), QStringLiteral("End Sub")}),
            expected);
}

TEST(IndentProcedureBlocks, ContinuedCaseLineKeepsItsBodyLevel) {
  const QStringList expected = {
      QStringLiteral("Sub T()"),    QStringLiteral("   Select Case x"), QStringLiteral("      Case 1, _"),
      QStringLiteral("         2"), QStringLiteral("         y = 1"),   QStringLiteral("   End Select"),
      QStringLiteral("   z = 1"),   QStringLiteral("End Sub"),
  };
  EXPECT_EQ(indented({QStringLiteral("Sub T()"), QStringLiteral("Select Case x"), QStringLiteral("Case 1, _"),
                      QStringLiteral("2"), QStringLiteral("y = 1"), QStringLiteral("End Select"),
                      QStringLiteral("z = 1"), QStringLiteral("End Sub")}),
            expected);
}

TEST(IndentProcedureBlocks, SingleLineIfOpensNoLevelButCommentAfterThenDoes) {
  const QStringList expected = {
      QStringLiteral("Sub T()"),
      QStringLiteral("   If a Then b = 1"),
      QStringLiteral("   c = 1"),
      QStringLiteral("   If a Then ' comentário"),
      QStringLiteral("      d = 1"),
      QStringLiteral("   End If"),
      QStringLiteral("   If s = \"'\" Then"),
      QStringLiteral("      e = 1"),
      QStringLiteral("   End If"),
      QStringLiteral("   If a Then MsgBox \"it's\""),
      QStringLiteral("   f = 1"),
      QStringLiteral("End Sub"),
  };
  EXPECT_EQ(indented({QStringLiteral("Sub T()"), QStringLiteral("If a Then b = 1"), QStringLiteral("c = 1"),
                      QStringLiteral("If a Then ' comentário"), QStringLiteral("d = 1"),
                      QStringLiteral("End If"), QStringLiteral("If s = \"'\" Then"), QStringLiteral("e = 1"),
                      QStringLiteral("End If"), QStringLiteral("If a Then MsgBox \"it's\""),
                      QStringLiteral("f = 1"), QStringLiteral("End Sub")}),
            expected);
}

TEST(IndentProcedureBlocks, ContinuedIfHeaderEndingInThenOpensALevel) {
  const QStringList expected = {
      QStringLiteral("Sub T()"),     QStringLiteral("   If a > 0 And _"), QStringLiteral("      b > 0 Then"),
      QStringLiteral("      c = 1"), QStringLiteral("   End If"),         QStringLiteral("   d = 1"),
      QStringLiteral("End Sub"),
  };
  EXPECT_EQ(indented({QStringLiteral("Sub T()"), QStringLiteral("If a > 0 And _"),
                      QStringLiteral("b > 0 Then"), QStringLiteral("c = 1"), QStringLiteral("End If"),
                      QStringLiteral("d = 1"), QStringLiteral("End Sub")}),
            expected);
}

TEST(IndentProcedureBlocks, ContinuedIfHeaderWithStatementAfterThenClosesItsLevel) {
  const QStringList expected = {
      QStringLiteral("Sub T()"),           QStringLiteral("   If a > 0 And _"),
      QStringLiteral("      b > 0 And _"), QStringLiteral("      c > 0 Then d = 1"),
      QStringLiteral("   e = 1"),          QStringLiteral("End Sub"),
  };
  EXPECT_EQ(
      indented({QStringLiteral("Sub T()"), QStringLiteral("If a > 0 And _"), QStringLiteral("b > 0 And _"),
                QStringLiteral("c > 0 Then d = 1"), QStringLiteral("e = 1"), QStringLiteral("End Sub")}),
      expected);
}

TEST(IndentProcedureBlocks, StatementOverThreeLinesIndentsItsContinuationLines) {
  const QStringList expected = {
      QStringLiteral("Sub T()"), QStringLiteral("   x = 1 + _"), QStringLiteral("      2 + _"),
      QStringLiteral("      3"), QStringLiteral("   y = 4"),     QStringLiteral("End Sub"),
  };
  EXPECT_EQ(indented({QStringLiteral("Sub T()"), QStringLiteral("x = 1 + _"), QStringLiteral("   2 + _"),
                      QStringLiteral("\t3"), QStringLiteral("        y = 4"), QStringLiteral("End Sub")}),
            expected);
}

TEST(IndentProcedureBlocks, HeaderContinuationLinesSitAtTheBodyLevel) {
  const QStringList expected = {
      QStringLiteral("Private Sub Foo(ByVal a As Long, _"),
      QStringLiteral("   ByVal b As Long, _"),
      QStringLiteral("   ByVal c As Long)"),
      QStringLiteral("   x = a"),
      QStringLiteral("End Sub"),
  };
  EXPECT_EQ(indented({QStringLiteral("Private Sub Foo(ByVal a As Long, _"),
                      QStringLiteral("                ByVal b As Long, _"),
                      QStringLiteral("                ByVal c As Long)"), QStringLiteral("x = a"),
                      QStringLiteral("End Sub")}),
            expected);
}

TEST(IndentProcedureBlocks, LookAlikeNamesAreOrdinaryLines) {
  const QStringList expected = {
      QStringLiteral("Sub T()"),          QStringLiteral("   DoEvents"),  QStringLiteral("   Nextx = 1"),
      QStringLiteral("   Elsewhere = 2"), QStringLiteral("   Loops = 3"), QStringLiteral("   Wending = 4"),
      QStringLiteral("   Formatar x"),    QStringLiteral("   Withdraw"),  QStringLiteral("   Cases = 5"),
      QStringLiteral("End Sub"),
  };
  EXPECT_EQ(indented({QStringLiteral("Sub T()"), QStringLiteral("DoEvents"), QStringLiteral("Nextx = 1"),
                      QStringLiteral("Elsewhere = 2"), QStringLiteral("Loops = 3"),
                      QStringLiteral("Wending = 4"), QStringLiteral("Formatar x"), QStringLiteral("Withdraw"),
                      QStringLiteral("Cases = 5"), QStringLiteral("End Sub")}),
            expected);
}

TEST(IndentProcedureBlocks, LoopKeywordsWithConditionsCountersAndCommentsAreBlockLines) {
  const QStringList expected = {
      QStringLiteral("Sub T()"),
      QStringLiteral("   Do While a < 3"),
      QStringLiteral("      a = a + 1"),
      QStringLiteral("   Loop"),
      QStringLiteral("   Do ' sempre"),
      QStringLiteral("      For i = 1 To 3"),
      QStringLiteral("         b = i"),
      QStringLiteral("      Next i"),
      QStringLiteral("   Loop Until b > 5"),
      QStringLiteral("   While c"),
      QStringLiteral("      With obj"),
      QStringLiteral("         .Nome = 1"),
      QStringLiteral("      End With"),
      QStringLiteral("   Wend\t' fim"),
      QStringLiteral("   Do"),
      QStringLiteral("   Loop"),
      QStringLiteral("End Sub"),
  };
  EXPECT_EQ(
      indented({QStringLiteral("Sub T()"), QStringLiteral("Do While a < 3"), QStringLiteral("a = a + 1"),
                QStringLiteral("Loop"), QStringLiteral("Do ' sempre"), QStringLiteral("For i = 1 To 3"),
                QStringLiteral("b = i"), QStringLiteral("Next i"), QStringLiteral("Loop Until b > 5"),
                QStringLiteral("While c"), QStringLiteral("With obj"), QStringLiteral(".Nome = 1"),
                QStringLiteral("End With"), QStringLiteral("Wend\t' fim"), QStringLiteral("Do"),
                QStringLiteral("Loop"), QStringLiteral("End Sub")}),
      expected);
}

TEST(IndentProcedureBlocks, ElseIfAndDirectivesCloseAndReopenTheirLevel) {
  const QStringList expected = {
      QStringLiteral("Sub P()"),
      QStringLiteral("   #If DEBUG Then"),
      QStringLiteral("      Debug.Print 1"),
      QStringLiteral("   #ElseIf TESTE Then"),
      QStringLiteral("      Debug.Print 2"),
      QStringLiteral("   #Else"),
      QStringLiteral("      Debug.Print 3"),
      QStringLiteral("   #End If"),
      QStringLiteral("   If a Then"),
      QStringLiteral("      x = 1"),
      QStringLiteral("   ElseIf b Then"),
      QStringLiteral("      y = 1"),
      QStringLiteral("   Else ' resto"),
      QStringLiteral("      z = 1"),
      QStringLiteral("   End If"),
      QStringLiteral("End Sub"),
  };
  EXPECT_EQ(
      indented({QStringLiteral("Sub P()"), QStringLiteral("#If DEBUG Then"), QStringLiteral("Debug.Print 1"),
                QStringLiteral("#ElseIf TESTE Then"), QStringLiteral("Debug.Print 2"),
                QStringLiteral("#Else"), QStringLiteral("Debug.Print 3"), QStringLiteral("#End If"),
                QStringLiteral("If a Then"), QStringLiteral("x = 1"), QStringLiteral("ElseIf b Then"),
                QStringLiteral("y = 1"), QStringLiteral("Else ' resto"), QStringLiteral("z = 1"),
                QStringLiteral("End If"), QStringLiteral("End Sub")}),
      expected);
}

TEST(IndentProcedureBlocks, UnbalancedClosersDoNotLeaveTheBody) {
  const QStringList expected = {
      QStringLiteral("Sub U()"),   QStringLiteral("   If a Then"), QStringLiteral("   End If"),
      QStringLiteral("   End If"), QStringLiteral("   Next"),      QStringLiteral("   End Select"),
      QStringLiteral("   x = 1"),  QStringLiteral("End Sub"),
  };
  EXPECT_EQ(indented({QStringLiteral("Sub U()"), QStringLiteral("If a Then"), QStringLiteral("End If"),
                      QStringLiteral("End If"), QStringLiteral("Next"), QStringLiteral("End Select"),
                      QStringLiteral("x = 1"), QStringLiteral("End Sub")}),
            expected);
}

TEST(IndentProcedureBlocks, TabModeWritesOneTabPerLevelWhateverTheSpaceCount) {
  const QStringList expected = {
      QStringLiteral("Sub T()"),       QStringLiteral("\tx = 1"), QStringLiteral("\tIf a Then"),
      QStringLiteral("\t\ty = 1 + _"), QStringLiteral("\t\t\t2"), QStringLiteral("\tEnd If"),
      QStringLiteral("End Sub"),
  };
  const QStringList input = {QStringLiteral("Sub T()"),   QStringLiteral("    x = 1"),
                             QStringLiteral("If a Then"), QStringLiteral("y = 1 + _"),
                             QStringLiteral("2"),         QStringLiteral("  End If"),
                             QStringLiteral("End Sub")};
  EXPECT_EQ(indented(input, IndentMode::Tabs, 1), expected);
  EXPECT_EQ(indented(input, IndentMode::Tabs, 8), expected);
}

// --- The number column ---

TEST(NumberColumn, WidestPrefixGivesTheColumn) {
  const QStringList lines = {QStringLiteral("10000 x = 1"), QStringLiteral("y = 2"),
                             QStringLiteral("10: z = 3")};
  EXPECT_EQ(NumberColumnWidth(lines), QStringLiteral("      "));
}

TEST(NumberColumn, PrefixFormsAreMeasuredAsTheyAreWritten) {
  EXPECT_EQ(numberPrefixLength(u"10: x"), 3);
  EXPECT_EQ(numberPrefixLength(u"10 : x"), 4);
  EXPECT_EQ(numberPrefixLength(u"10 ' nota"), 3);
  EXPECT_EQ(numberPrefixLength(u"10' nota"), 3);
  EXPECT_EQ(numberPrefixLength(u"    10 x"), 3);
  EXPECT_EQ(numberPrefixLength(u"1.5 x"), 4);
  EXPECT_EQ(numberPrefixLength(u"-10 x"), 4);
}

TEST(NumberColumn, LinesWithoutAUsableNumberHaveNoPrefix) {
  for (const char16_t* line : {u"", u"   ", u"x = 1", u"10000", u"10. x", u"10, x", u"Erro: x", u"' 10 x"}) {
    EXPECT_EQ(numberPrefixLength(line), 0) << QString::fromUtf16(line).toStdString();
  }
  EXPECT_EQ(NumberColumnWidth(QStringList{QStringLiteral("x"), QStringLiteral("y")}), QString());
}

TEST(NumberColumn, ContinuationLinesBeginningWithANumberAreNotMeasured) {
  EXPECT_EQ(NumberColumnWidth(QStringList{QStringLiteral("x = 1 + _"), QStringLiteral("  200000 + _"),
                                          QString(), QStringLiteral("300000 * y"), QStringLiteral("z = 1")}),
            QString());
  EXPECT_EQ(NumberColumnWidth(QStringList{QStringLiteral("10 x = _"), QStringLiteral("200000 + 1"),
                                          QStringLiteral("' nota _"), QStringLiteral("40000 palavras")}),
            QStringLiteral("   "));
}

TEST(NumberColumn, ContinuationLinesBeginningWithANumberAreIndentedAsCode) {
  const QStringList expected = {
      QStringLiteral("Sub T()"),           QStringLiteral("10000    x = a + _"),
      QStringLiteral("            2 * b"), QStringLiteral("10005    For i = 1 To _"),
      QStringLiteral("            10"),    QStringLiteral("10010       y = i"),
      QStringLiteral("10015    Next"),     QStringLiteral("End Sub"),
  };
  const QStringList once =
      numberedAndIndented({QStringLiteral("Sub T()"), QStringLiteral("x = a + _"), QStringLiteral("2 * b"),
                           QStringLiteral("For i = 1 To _"), QStringLiteral("10"), QStringLiteral("y = i"),
                           QStringLiteral("Next"), QStringLiteral("End Sub")},
                          IndentMode::Spaces, 3);
  EXPECT_EQ(once, expected);
  EXPECT_EQ(numberedAndIndented(once, IndentMode::Spaces, 3), expected);
}

TEST(NumberColumn, ColonsAndQuotesInsideStringsDoNotMakeAPrefix) {
  // The ":" and "'" of the string literal are passed over; the number before the first blank counts.
  EXPECT_EQ(numberPrefixLength(u"10 MsgBox \"a:b\" ' nota"), 3);
  EXPECT_EQ(numberPrefixLength(u"MsgBox \"10: x\""), 0);
}

TEST(NumberColumn, BlanksAfterTheNumberBelongToTheIndentation) {
  EXPECT_EQ(numberPrefixLength(u"10000 \t\tx = 1"), 6);
  EXPECT_EQ(numberPrefixLength(u"10000\tx = 1"), 6);
  EXPECT_EQ(numberPrefixLength(u"30    \t' nota"), 3);
  EXPECT_EQ(numberPrefixLength(u"20:   \tz = 1"), 3);
}

TEST(NumberColumn, NumberedProcedureIsAlignedInASixCharacterColumn) {
  const QStringList expected = {
      QStringLiteral("Sub Foo()"),
      QStringLiteral("10000    x = 1"),
      QStringLiteral("10005    If a Then"),
      QStringLiteral("10010       b = 1"),
      QStringLiteral("10015    End If"),
      QStringLiteral("         Erro:"),
      QStringLiteral("5        y = 1"),
      QStringLiteral("20:      z = 1"),
      QStringLiteral("30       ' nota"),
      QStringLiteral("10020    MsgBox \"a:b\""),
      QStringLiteral("End Sub"),
  };
  const QStringList input = {
      QStringLiteral("Sub Foo()"),       QStringLiteral("10000 x = 1"),
      QStringLiteral("10005 If a Then"), QStringLiteral("10010 b = 1"),
      QStringLiteral("10015 End If"),    QStringLiteral("Erro:"),
      QStringLiteral("5 y = 1"),         QStringLiteral("20: z = 1"),
      QStringLiteral("30 ' nota"),       QStringLiteral("10020 MsgBox \"a:b\""),
      QStringLiteral("End Sub"),
  };
  EXPECT_EQ(indented(input), expected);
}

TEST(NumberColumn, ColumnIsStableAcrossRunsInTabMode) {
  QStringList lines = {QStringLiteral("Sub Foo()"), QStringLiteral("10000 x = 1"),
                       QStringLiteral("30   ' nota"), QStringLiteral("y = 2"), QStringLiteral("End Sub")};
  Indenter indenter(IndentMode::Tabs, 1);
  indentProcedure(lines, indenter);
  const QStringList expected = {QStringLiteral("Sub Foo()"), QStringLiteral("10000 \tx = 1"),
                                QStringLiteral("30    \t' nota"), QStringLiteral("      \ty = 2"),
                                QStringLiteral("End Sub")};
  EXPECT_EQ(lines, expected);
  EXPECT_EQ(indentProcedure(lines, indenter), 0);
  EXPECT_EQ(lines, expected);
  EXPECT_EQ(indenter.numberColumn(), QStringLiteral("      "));
}

// --- Declarations ---

TEST(IndentDeclarations, TypeAndEnumMembersAreOneUnitIn) {
  const QStringList expected = {
      QStringLiteral("Option Explicit"), QStringLiteral("Private Type TPonto"),
      QStringLiteral("   X As Long"),    QStringLiteral("   Y As Long"),
      QStringLiteral("End Type"),        QStringLiteral("Public Enum ECor"),
      QStringLiteral("   Vermelho = 1"), QStringLiteral("   Azul = 2"),
      QStringLiteral("End Enum"),        QStringLiteral("Type TSimples"),
      QStringLiteral("   A As Integer"), QStringLiteral("End Type"),
      QStringLiteral("Enum ETamanho"),   QStringLiteral("   Pequeno"),
      QStringLiteral("End Enum"),        QStringLiteral("Dim m_x As Long"),
  };
  EXPECT_EQ(declarationsIndented(
                {QStringLiteral("   Option Explicit"), QStringLiteral("Private Type TPonto"),
                 QStringLiteral("X As Long"), QStringLiteral("\t\tY As Long"), QStringLiteral("  End Type"),
                 QStringLiteral("Public Enum ECor"), QStringLiteral("Vermelho = 1"),
                 QStringLiteral("Azul = 2"), QStringLiteral("End Enum"), QStringLiteral("Type TSimples"),
                 QStringLiteral("A As Integer"), QStringLiteral("End Type"), QStringLiteral("Enum ETamanho"),
                 QStringLiteral("Pequeno"), QStringLiteral("End Enum"), QStringLiteral("Dim m_x As Long")}),
            expected);
}

TEST(IndentDeclarations, DirectivesAndContinuedDeclarations) {
  const QStringList expected = {
      QStringLiteral("#If Win32 Then"),
      QStringLiteral("   Private Declare Function GetTickCount Lib \"kernel32\" () As Long"),
      QStringLiteral("#Else"),
      QStringLiteral("   Private Declare Function Foo Lib \"x\" _"),
      QStringLiteral("      (ByVal a As Long) As Long"),
      QStringLiteral("#End If"),
      QStringLiteral("Public Const A = 1"),
  };
  EXPECT_EQ(declarationsIndented(
                {QStringLiteral("#If Win32 Then"),
                 QStringLiteral("Private Declare Function GetTickCount Lib \"kernel32\" () As Long"),
                 QStringLiteral("#Else"), QStringLiteral("Private Declare Function Foo Lib \"x\" _"),
                 QStringLiteral("(ByVal a As Long) As Long"), QStringLiteral("#End If"),
                 QStringLiteral("Public Const A = 1")}),
            expected);
}

TEST(IndentDeclarations, NumbersAreNotAColumnAndUnbalancedClosersStayAtTheMargin) {
  const QStringList expected = {QStringLiteral("End Type"), QStringLiteral("10 Dim x"),
                                QStringLiteral("End Enum"), QStringLiteral("Dim y")};
  EXPECT_EQ(declarationsIndented({QStringLiteral("  End Type"), QStringLiteral("10 Dim x"),
                                  QStringLiteral("End Enum"), QStringLiteral("   Dim y")}),
            expected);
}

TEST(IndentDeclarations, TabModeUsesOneTab) {
  const QStringList expected = {QStringLiteral("Private Enum E"), QStringLiteral("\tA"),
                                QStringLiteral("End Enum")};
  EXPECT_EQ(declarationsIndented(
                {QStringLiteral("Private Enum E"), QStringLiteral("    A"), QStringLiteral("End Enum")},
                IndentMode::Tabs, 4),
            expected);
}

// --- Only changed lines are reported ---

TEST(IndentChanges, AlreadyIndentedProcedureReportsNoChange) {
  QStringList lines = {QStringLiteral("Sub T()"),     QStringLiteral("   If a Then"),
                       QStringLiteral("      b = 1"), QString(),
                       QStringLiteral("   End If"),   QStringLiteral("End Sub")};
  const QStringList before = lines;
  Indenter indenter(IndentMode::Spaces, 3);
  EXPECT_EQ(indentProcedure(lines, indenter), 0);
  EXPECT_EQ(lines, before);
}

TEST(IndentChanges, OnlyLinesWhoseTextDiffersAreReported) {
  QStringList lines = {QStringLiteral("Sub T()"), QStringLiteral("   a = 1"),  QStringLiteral("   b = 2   "),
                       QStringLiteral("\tc = 3"), QStringLiteral("    d = 4"), QStringLiteral("   e = 5"),
                       QStringLiteral("   "),     QStringLiteral("End Sub")};
  Indenter indenter(IndentMode::Spaces, 3);
  EXPECT_EQ(indentProcedure(lines, indenter), 3);
  const QStringList expected = {QStringLiteral("Sub T()"),  QStringLiteral("   a = 1"),
                                QStringLiteral("   b = 2"), QStringLiteral("   c = 3"),
                                QStringLiteral("   d = 4"), QStringLiteral("   e = 5"),
                                QStringLiteral("   "),      QStringLiteral("End Sub")};
  EXPECT_EQ(lines, expected);
}

TEST(IndentChanges, NumberColumnPaddingIsComparedToo) {
  Indenter indenter(IndentMode::Spaces, 3);
  indenter.beginProcedure(QStringLiteral("      "));
  bool continued = false;
  QString aligned = QStringLiteral("10000    x = 1");
  QString narrow = QStringLiteral("5 y");
  QString tabbed = QStringLiteral("      \tz");
  EXPECT_FALSE(indenter.IndentLine(aligned, continued));
  EXPECT_TRUE(indenter.IndentLine(narrow, continued));
  EXPECT_EQ(narrow, QStringLiteral("5        y"));
  EXPECT_TRUE(indenter.IndentLine(tabbed, continued));
  EXPECT_EQ(tabbed, QStringLiteral("         z"));
}

// --- Idempotence and the number-and-indent route ---

const QStringList kMessy = {
    QStringLiteral("Function Maior(a As Long, _"),
    QStringLiteral("  b As Long) As Long"),
    QStringLiteral("\t\tIf a > b Then   "),
    QStringLiteral("  Maior = a"),
    QStringLiteral("\tElseIf a = b Then"),
    QStringLiteral("Maior = a ' iguais"),
    QStringLiteral(" Else"),
    QStringLiteral("            Maior = b"),
    QStringLiteral("End If"),
    QStringLiteral("  Do While a > 0"),
    QStringLiteral("a = a - 1: DoEvents"),
    QStringLiteral("   Loop"),
    QStringLiteral("End Function"),
};

TEST(IndentIdempotence, IndentingTwiceInTabModeEqualsOnce) {
  const QStringList expected = {
      QStringLiteral("Function Maior(a As Long, _"),
      QStringLiteral("\tb As Long) As Long"),
      QStringLiteral("\tIf a > b Then"),
      QStringLiteral("\t\tMaior = a"),
      QStringLiteral("\tElseIf a = b Then"),
      QStringLiteral("\t\tMaior = a ' iguais"),
      QStringLiteral("\tElse"),
      QStringLiteral("\t\tMaior = b"),
      QStringLiteral("\tEnd If"),
      QStringLiteral("\tDo While a > 0"),
      QStringLiteral("\t\ta = a - 1: DoEvents"),
      QStringLiteral("\tLoop"),
      QStringLiteral("End Function"),
  };
  QStringList lines = kMessy;
  Indenter indenter(IndentMode::Tabs, 1);
  indentProcedure(lines, indenter);
  EXPECT_EQ(lines, expected);
  EXPECT_EQ(indentProcedure(lines, indenter), 0);
  EXPECT_EQ(lines, expected);
}

TEST(IndentIdempotence, IndentingTwiceInSpaceModeEqualsOnce) {
  const QStringList expected = {
      QStringLiteral("Function Maior(a As Long, _"),
      QStringLiteral("    b As Long) As Long"),
      QStringLiteral("    If a > b Then"),
      QStringLiteral("        Maior = a"),
      QStringLiteral("    ElseIf a = b Then"),
      QStringLiteral("        Maior = a ' iguais"),
      QStringLiteral("    Else"),
      QStringLiteral("        Maior = b"),
      QStringLiteral("    End If"),
      QStringLiteral("    Do While a > 0"),
      QStringLiteral("        a = a - 1: DoEvents"),
      QStringLiteral("    Loop"),
      QStringLiteral("End Function"),
  };
  QStringList lines = kMessy;
  Indenter indenter(IndentMode::Spaces, 4);
  indentProcedure(lines, indenter);
  EXPECT_EQ(lines, expected);
  EXPECT_EQ(indentProcedure(lines, indenter), 0);
  EXPECT_EQ(lines, expected);
}

const QStringList kCalcular = {
    QStringLiteral("Private Sub Calcular(ByVal n As Long)"),
    QStringLiteral("    Dim i As Long"),
    QStringLiteral("    On Error GoTo Erro"),
    QString(),
    QStringLiteral("    If n > 0 Then"),
    QStringLiteral("        For i = 1 To n"),
    QStringLiteral("            Total = Total + _"),
    QStringLiteral("                i"),
    QStringLiteral("        Next i"),
    QStringLiteral("    Else"),
    QStringLiteral("        Select Case n"),
    QStringLiteral("            Case 0"),
    QStringLiteral("                MsgBox \"zero\""),
    QStringLiteral("            Case Else"),
    QStringLiteral("                MsgBox \"negativo\""),
    QStringLiteral("        End Select"),
    QStringLiteral("    End If"),
    QStringLiteral("    ' fim"),
    QStringLiteral("    Exit Sub"),
    QStringLiteral("Erro:"),
    QStringLiteral("    MsgBox Err.Description"),
    QStringLiteral("End Sub"),
};

TEST(NumberAndIndent, NumberingDialogRouteAlignsNumbersAndIndentsWithTabs) {
  const QStringList expected = {
      QStringLiteral("Private Sub Calcular(ByVal n As Long)"),
      QStringLiteral("10000 \tDim i As Long"),
      QStringLiteral("10005 \tOn Error GoTo Erro"),
      QString(),
      QStringLiteral("10010 \tIf n > 0 Then"),
      QStringLiteral("10015 \t\tFor i = 1 To n"),
      QStringLiteral("10020 \t\t\tTotal = Total + _"),
      QStringLiteral("      \t\t\t\ti"),
      QStringLiteral("10025 \t\tNext i"),
      QStringLiteral("10030 \tElse"),
      QStringLiteral("10035 \t\tSelect Case n"),
      QStringLiteral("      \t\t\tCase 0"),
      QStringLiteral("10040 \t\t\t\tMsgBox \"zero\""),
      QStringLiteral("      \t\t\tCase Else"),
      QStringLiteral("10045 \t\t\t\tMsgBox \"negativo\""),
      QStringLiteral("10050 \t\tEnd Select"),
      QStringLiteral("10055 \tEnd If"),
      QStringLiteral("      \t' fim"),
      QStringLiteral("10060 \tExit Sub"),
      QStringLiteral("      \tErro:"),
      QStringLiteral("10065 \tMsgBox Err.Description"),
      QStringLiteral("End Sub"),
  };
  const QStringList once = numberedAndIndented(kCalcular, IndentMode::Tabs, 1);
  EXPECT_EQ(once, expected);
  EXPECT_EQ(numberedAndIndented(once, IndentMode::Tabs, 1), expected);
}

TEST(NumberAndIndent, IndentationDialogRouteAlignsNumbersAndIndentsWithSpaces) {
  const QStringList expected = {
      QStringLiteral("Private Sub Calcular(ByVal n As Long)"),
      QStringLiteral("10000    Dim i As Long"),
      QStringLiteral("10005    On Error GoTo Erro"),
      QString(),
      QStringLiteral("10010    If n > 0 Then"),
      QStringLiteral("10015       For i = 1 To n"),
      QStringLiteral("10020          Total = Total + _"),
      QStringLiteral("                  i"),
      QStringLiteral("10025       Next i"),
      QStringLiteral("10030    Else"),
      QStringLiteral("10035       Select Case n"),
      QStringLiteral("               Case 0"),
      QStringLiteral("10040             MsgBox \"zero\""),
      QStringLiteral("               Case Else"),
      QStringLiteral("10045             MsgBox \"negativo\""),
      QStringLiteral("10050       End Select"),
      QStringLiteral("10055    End If"),
      QStringLiteral("         ' fim"),
      QStringLiteral("10060    Exit Sub"),
      QStringLiteral("         Erro:"),
      QStringLiteral("10065    MsgBox Err.Description"),
      QStringLiteral("End Sub"),
  };
  const QStringList once = numberedAndIndented(kCalcular, IndentMode::Spaces, 3);
  EXPECT_EQ(once, expected);
  EXPECT_EQ(numberedAndIndented(once, IndentMode::Spaces, 3), expected);
}

TEST(NumberAndIndent, RemovingNumbersThenIndentingLeavesAnEmptyColumn) {
  const QStringList expected = {
      QStringLiteral("Private Sub Calcular(ByVal n As Long)"),
      QStringLiteral("   Dim i As Long"),
      QStringLiteral("   On Error GoTo Erro"),
      QString(),
      QStringLiteral("   If n > 0 Then"),
      QStringLiteral("      For i = 1 To n"),
      QStringLiteral("         Total = Total + _"),
      QStringLiteral("            i"),
      QStringLiteral("      Next i"),
      QStringLiteral("   Else"),
      QStringLiteral("      Select Case n"),
      QStringLiteral("         Case 0"),
      QStringLiteral("            MsgBox \"zero\""),
      QStringLiteral("         Case Else"),
      QStringLiteral("            MsgBox \"negativo\""),
      QStringLiteral("      End Select"),
      QStringLiteral("   End If"),
      QStringLiteral("   ' fim"),
      QStringLiteral("   Exit Sub"),
      QStringLiteral("   Erro:"),
      QStringLiteral("   MsgBox Err.Description"),
      QStringLiteral("End Sub"),
  };
  const QStringList numbered = numberedAndIndented(kCalcular, IndentMode::Spaces, 3);
  EXPECT_EQ(indented(unnumberProcedure(numbered), IndentMode::Spaces, 3), expected);
}

TEST(NumberAndIndent, RenumberingWithOtherNumbersKeepsTheLayout) {
  const QStringList first = numberedAndIndented(kCalcular, IndentMode::Tabs, 1);
  const QStringList renumbered = indented(numberProcedure(first, 1, 1), IndentMode::Tabs, 1);
  EXPECT_EQ(renumbered[1], QStringLiteral("1  \tDim i As Long"));
  EXPECT_EQ(renumbered[7], QStringLiteral("   \t\t\t\ti"));
  EXPECT_EQ(renumbered[20], QStringLiteral("14 \tMsgBox Err.Description"));
}

}  // namespace
}  // namespace transform
