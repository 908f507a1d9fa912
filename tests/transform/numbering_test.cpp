// SPDX-License-Identifier: MIT
// Adding and removing line numbers, line by line and over whole procedures walked as the numbering
// command walks them.
#include "transform/numbering.h"

#include "printers.h"
#include "procedurewalk.h"

#include <gtest/gtest.h>

#include <limits>

namespace transform {
namespace {

constexpr qint32 kMax = std::numeric_limits<qint32>::max();
constexpr qint32 kMin = std::numeric_limits<qint32>::min();

// One NumberLine call, as the first numbered line of a procedure with start 10000 and interval 5 by default.
struct Numbered {
  QString line;
  bool changed = false;
  qint32 number = 0;
  bool continuation = false;
};

Numbered numberOne(const QString& text, qint32 running = 9995, bool continuation = false,
                   qint32 interval = 5) {
  Numbered out{text, false, running, continuation};
  out.changed = NumberLine(out.line, out.number, out.continuation, interval);
  return out;
}

QString unnumbered(const QString& text, bool expectChange) {
  QString line = text;
  EXPECT_EQ(UnnumberLine(line), expectChange) << text.toStdString();
  return line;
}

// --- Lines that never get a number ---

TEST(NumberLineSkips, BlankLinesAreUnchangedAndEndAContinuation) {
  for (const QString& text :
       {QString(), QStringLiteral("    "), QStringLiteral("\t"), QStringLiteral(" \t ")}) {
    const Numbered n = numberOne(text, 9995, true);
    EXPECT_FALSE(n.changed);
    EXPECT_EQ(n.line, text);
    EXPECT_EQ(n.number, 9995);
    EXPECT_FALSE(n.continuation);
  }
}

TEST(NumberLineSkips, CommentLinesAreUnchangedAndEndAContinuation) {
  for (const QString& text : {QStringLiteral("' nota"), QStringLiteral("    ' nota"),
                              QStringLiteral("\t' nota"), QStringLiteral("'x _")}) {
    const Numbered n = numberOne(text, 9995, true);
    EXPECT_FALSE(n.changed) << text.toStdString();
    EXPECT_EQ(n.line, text);
    EXPECT_EQ(n.number, 9995);
    // Unless the comment itself goes on over the next line.
    EXPECT_EQ(n.continuation, text.endsWith(u'_'));
  }
}

TEST(NumberLineSkips, DeclarationsDirectivesCaseLinesAndProcedureEndsGetNoNumber) {
  for (const QString& text : {
           QStringLiteral("Private Const A = 1"),
           QStringLiteral("    Public X As Long"),
           QStringLiteral("Friend Function F() As Long"),
           QStringLiteral("        Case 1"),
           QStringLiteral("Case Else"),
           QStringLiteral("Event Changed()"),
           QStringLiteral("Sub Foo()"),
           QStringLiteral("Function Bar() As Long"),
           QStringLiteral("Property Get Nome() As String"),
           QStringLiteral("#If DEBUG Then"),
           QStringLiteral("\t#End If"),
           QStringLiteral("End Sub"),
           QStringLiteral("End Function"),
           QStringLiteral("End Property"),
       }) {
    const Numbered n = numberOne(text);
    EXPECT_FALSE(n.changed) << text.toStdString();
    EXPECT_EQ(n.line, text);
    EXPECT_EQ(n.number, 9995);
    EXPECT_FALSE(n.continuation);
  }
}

TEST(NumberLineSkips, ContinuedDeclarationOrCaseMarksTheNextLineAsContinuation) {
  Numbered n = numberOne(QStringLiteral("Private Declare Function GetTickCount Lib \"kernel32\" _"));
  EXPECT_FALSE(n.changed);
  EXPECT_TRUE(n.continuation);
  n = numberOne(QStringLiteral("        Case 1, 2, _"));
  EXPECT_FALSE(n.changed);
  EXPECT_TRUE(n.continuation);
}

TEST(NumberLineSkips, KeywordsAreCaseSensitive) {
  EXPECT_EQ(numberOne(QStringLiteral("private_x = 1")).line, QStringLiteral("10000 private_x = 1"));
  EXPECT_EQ(numberOne(QStringLiteral("Cases = 2")).line, QStringLiteral("10000 Cases = 2"));
}

// --- Continued statements get one number, on their first line ---

TEST(NumberLineContinuation, StatementOverThreeLinesIsNumberedOnItsFirstLineOnly) {
  qint32 number = 9995;
  bool continuation = false;
  QString first = QStringLiteral("    x = 1 + _");
  QString second = QStringLiteral("        2 + _");
  QString third = QStringLiteral("        3");
  QString next = QStringLiteral("    y = x");

  EXPECT_TRUE(NumberLine(first, number, continuation, 5));
  EXPECT_EQ(first, QStringLiteral("10000     x = 1 + _"));
  EXPECT_TRUE(continuation);
  EXPECT_FALSE(NumberLine(second, number, continuation, 5));
  EXPECT_EQ(second, QStringLiteral("        2 + _"));
  EXPECT_TRUE(continuation);
  EXPECT_FALSE(NumberLine(third, number, continuation, 5));
  EXPECT_EQ(third, QStringLiteral("        3"));
  EXPECT_FALSE(continuation);
  EXPECT_TRUE(NumberLine(next, number, continuation, 5));
  EXPECT_EQ(next, QStringLiteral("10005     y = x"));
  EXPECT_EQ(number, 10005);
}

TEST(NumberLineContinuation, BlankOrCommentLineEndsTheContinuation) {
  const QStringList walked = numberProcedure({
      QStringLiteral("Sub A()"),
      QStringLiteral("x = 1 + _"),
      QString(),
      QStringLiteral("y = 2"),
      QStringLiteral("z = 3 + _"),
      QStringLiteral("\t' nota"),
      QStringLiteral("w = 4"),
      QStringLiteral("' nota longa _"),
      QStringLiteral("    que continua"),
      QStringLiteral("End Sub"),
  });
  const QStringList expected = {
      QStringLiteral("Sub A()"),     QStringLiteral("10000 x = 1 + _"), QString(),
      QStringLiteral("10005 y = 2"), QStringLiteral("10010 z = 3 + _"), QStringLiteral("\t' nota"),
      QStringLiteral("10015 w = 4"), QStringLiteral("' nota longa _"),  QStringLiteral("    que continua"),
      QStringLiteral("End Sub"),
  };
  EXPECT_EQ(walked, expected);
}

// --- How a number goes in ---

TEST(NumberLineRules, IndentedStatementGetsNumberSpaceAndItsIndentation) {
  const Numbered n = numberOne(QStringLiteral("    x = 1"));
  EXPECT_TRUE(n.changed);
  EXPECT_EQ(n.line, QStringLiteral("10000     x = 1"));
  EXPECT_EQ(n.number, 10000);
  EXPECT_FALSE(n.continuation);
}

TEST(NumberLineRules, OneWordLineGetsTwoSpaces) {
  EXPECT_EQ(numberOne(QStringLiteral("Else")).line, QStringLiteral("10000  Else"));
  EXPECT_EQ(numberOne(QStringLiteral("    Loop")).line, QStringLiteral("10000      Loop"));
  EXPECT_EQ(numberOne(QStringLiteral("Next")).number, 10000);
}

TEST(NumberLineRules, EachNumberedLineAddsTheInterval) {
  qint32 number = 9995;
  bool continuation = false;
  QString a = QStringLiteral("Dim i As Long");
  QString b = QStringLiteral("End If");
  QString c = QStringLiteral("End Select");
  NumberLine(a, number, continuation, 5);
  NumberLine(b, number, continuation, 5);
  NumberLine(c, number, continuation, 5);
  EXPECT_EQ(a, QStringLiteral("10000 Dim i As Long"));
  EXPECT_EQ(b, QStringLiteral("10005 End If"));
  EXPECT_EQ(c, QStringLiteral("10010 End Select"));
  EXPECT_EQ(number, 10010);
}

TEST(NumberLineRules, AnOldNumberGivesWayToTheNewOneWithItsSeparator) {
  // The new number takes the old one's place and its blank (or colon and blank), the indentation before
  // it goes after the new number, and numbering the result again changes nothing.
  const std::pair<const char16_t*, const char16_t*> rows[] = {
      {u"10 x = 1", u"10000 x = 1"},
      {u"-5 x = 1", u"10000 x = 1"},
      {u"  20 x = 1", u"10000   x = 1"},
      {u"10: x = 1", u"10000 x = 1"},
      {u"  10: x = 1", u"10000   x = 1"},
      {u"10:x = 1", u"10000 x = 1"},
      {u"10\tx = 1", u"10000 x = 1"},
      {u"\t10 x = 1", u"10000 \tx = 1"},
      {u"10  Next", u"10000  Next"},
      {u"10 MsgBox \"a:b\"", u"10000 MsgBox \"a:b\""},
      {u"10000      Loop", u"10000      Loop"},
  };
  for (const auto& [text, expected] : rows) {
    const Numbered once = numberOne(QString::fromUtf16(text));
    EXPECT_EQ(once.line, QString::fromUtf16(expected));
    EXPECT_EQ(once.number, 10000);
    EXPECT_EQ(numberOne(once.line).line, once.line);
  }
}

TEST(NumberLineRules, NumberInFrontOfACommentIsDroppedAndTakesNoNumber) {
  Numbered n = numberOne(QStringLiteral("10 ' nota"));
  EXPECT_TRUE(n.changed);
  EXPECT_EQ(n.line, QStringLiteral("' nota"));
  EXPECT_EQ(n.number, 9995);
  n = numberOne(QStringLiteral("    10' nota"));
  EXPECT_EQ(n.line, QStringLiteral("    ' nota"));
  EXPECT_EQ(n.number, 9995);
}

TEST(NumberLineRules, LineHoldingOnlyANumberIsEmptied) {
  for (const QString& text :
       {QStringLiteral("10"), QStringLiteral("   10  "), QStringLiteral("\t-5"), QStringLiteral("1.5")}) {
    const Numbered n = numberOne(text);
    EXPECT_TRUE(n.changed) << text.toStdString();
    EXPECT_EQ(n.line, QString());
    EXPECT_EQ(n.number, 9995);
  }
}

TEST(NumberLineRules, TextEndingInPointOrCommaIsNotANumber) {
  EXPECT_EQ(numberOne(QStringLiteral("10.")).line, QStringLiteral("10000  10."));
  EXPECT_EQ(numberOne(QStringLiteral("10. x")).line, QStringLiteral("10000 10. x"));
  EXPECT_EQ(numberOne(QStringLiteral("10, x")).line, QStringLiteral("10000 10, x"));
  EXPECT_EQ(numberOne(QStringLiteral("10.: x")).line, QStringLiteral("10000 10.: x"));
}

TEST(NumberLineRules, ColonsAndQuotesInsideCodeAreNotLabelsOrComments) {
  EXPECT_EQ(numberOne(QStringLiteral("x = a: y = b")).line, QStringLiteral("10000 x = a: y = b"));
  EXPECT_EQ(numberOne(QStringLiteral("MsgBox \"it's\"")).line, QStringLiteral("10000 MsgBox \"it's\""));
}

TEST(NumberLineRules, NegativeNumbersAreWrittenWithAMinus) {
  const Numbered n = numberOne(QStringLiteral("x = 1"), -15, false, 5);
  EXPECT_EQ(n.line, QStringLiteral("-10 x = 1"));
  EXPECT_EQ(n.number, -10);
}

TEST(NumberLineRules, ContinuedStatementSetsTheFlag) {
  const Numbered n = numberOne(QStringLiteral("x = 1 + _"));
  EXPECT_EQ(n.line, QStringLiteral("10000 x = 1 + _"));
  EXPECT_TRUE(n.continuation);
}

// --- Alphanumeric labels ---

TEST(NumberLineLabels, LineBeginningWithALabelIsNeverNumbered) {
  for (const QString& text :
       {QStringLiteral("ErrorHandler:"), QStringLiteral("Erro: x = 1"), QStringLiteral("    Saida:"),
        QStringLiteral("Ação:"), QStringLiteral("Label_1: ' nota"), QStringLiteral("\tFim:")}) {
    const Numbered n = numberOne(text);
    EXPECT_FALSE(n.changed) << text.toStdString();
    EXPECT_EQ(n.line, text);
    EXPECT_EQ(n.number, 9995);
  }
}

TEST(NumberLineLabels, KeywordFollowedByColonIsAStatement) {
  EXPECT_EQ(numberOne(QStringLiteral("Else:")).line, QStringLiteral("10000  Else:"));
  EXPECT_EQ(numberOne(QStringLiteral("    Else: x = 1")).line, QStringLiteral("10000     Else: x = 1"));
  EXPECT_EQ(numberOne(QStringLiteral("End:")).line, QStringLiteral("10000  End:"));
  EXPECT_EQ(numberOne(QStringLiteral("Resume: x = 1")).line, QStringLiteral("10000 Resume: x = 1"));
  EXPECT_EQ(numberOne(QStringLiteral("else:")).line, QStringLiteral("10000  else:"));
}

TEST(NumberLineLabels, LabelWithSpaceBeforeTheColonOrNameCallIsNumbered) {
  EXPECT_EQ(numberOne(QStringLiteral("Foo x:=1")).line, QStringLiteral("10000 Foo x:=1"));
  EXPECT_EQ(numberOne(QStringLiteral("1Erro: x")).line, QStringLiteral("10000 1Erro: x"));
}

TEST(NumberLineLabels, ContinuedStatementAfterALabelKeepsItsContinuationUnnumbered) {
  const QStringList walked = numberProcedure({
      QStringLiteral("Sub A()"),
      QStringLiteral("Erro: x = 1 + _"),
      QStringLiteral("    2"),
      QStringLiteral("y = 3"),
      QStringLiteral("End Sub"),
  });
  const QStringList expected = {
      QStringLiteral("Sub A()"),     QStringLiteral("Erro: x = 1 + _"), QStringLiteral("    2"),
      QStringLiteral("10000 y = 3"), QStringLiteral("End Sub"),
  };
  EXPECT_EQ(walked, expected);
}

// --- Running numbers never wrap ---

TEST(NumberLineOverflow, LastRepresentableNumberIsWritten) {
  const Numbered n = numberOne(QStringLiteral("x = 1"), kMax - 5, false, 5);
  EXPECT_EQ(n.line, QStringLiteral("2147483647 x = 1"));
  EXPECT_EQ(n.number, kMax);
}

TEST(NumberLineOverflow, PassingTheLargestNumberThrowsAndChangesNothing) {
  QString line = QStringLiteral("    x = 1 + _");
  qint32 number = kMax - 4;
  bool continuation = false;
  EXPECT_THROW(NumberLine(line, number, continuation, 5), LineNumberOverflow);
  EXPECT_EQ(line, QStringLiteral("    x = 1 + _"));
  EXPECT_EQ(number, kMax - 4);
  EXPECT_FALSE(continuation);
}

TEST(NumberLineOverflow, PassingTheSmallestNumberThrows) {
  QString line = QStringLiteral("Else");
  qint32 number = kMin + 2;
  bool continuation = false;
  EXPECT_THROW(NumberLine(line, number, continuation, -5), LineNumberOverflow);
  EXPECT_EQ(line, QStringLiteral("Else"));
  EXPECT_EQ(number, kMin + 2);
}

TEST(NumberLineOverflow, OverflowIsAnObjectModelErrorNumberSix) {
  QString line = QStringLiteral("10: x = 1");
  qint32 number = kMax;
  bool continuation = false;
  try {
    NumberLine(line, number, continuation, 1);
    FAIL() << "no overflow reported";
  } catch (const ide::Error& error) {
    EXPECT_EQ(error.number(), 6);
    EXPECT_EQ(error.description(), QStringLiteral("Overflow"));
  }
}

TEST(NumberLineOverflow, LinesThatTakeNoNumberDoNotOverflow) {
  Numbered n = numberOne(QStringLiteral("10 ' nota"), kMax);
  EXPECT_EQ(n.line, QStringLiteral("' nota"));
  n = numberOne(QStringLiteral("Case 1"), kMax);
  EXPECT_FALSE(n.changed);
  n = numberOne(QStringLiteral("10"), kMax);
  EXPECT_EQ(n.line, QString());
  EXPECT_EQ(n.number, kMax);
}

// --- Tabs are blanks ---

TEST(NumberLineTabs, LeadingTabsAreKeptExactly) {
  EXPECT_EQ(numberOne(QStringLiteral("\tx = 1")).line, QStringLiteral("10000 \tx = 1"));
  EXPECT_EQ(numberOne(QStringLiteral("\t\tElse")).line, QStringLiteral("10000  \t\tElse"));
  EXPECT_EQ(numberOne(QStringLiteral(" \tx = 1\t")).line, QStringLiteral("10000  \tx = 1\t"));
}

TEST(NumberLineTabs, TrailingTabDoesNotHideTheContinuationMark) {
  const Numbered n = numberOne(QStringLiteral("x = 1 + _\t"));
  EXPECT_TRUE(n.continuation);
}

// --- Removing numbers ---

TEST(UnnumberLineRules, TheNumberAndItsSeparatorGoTheRestStays) {
  // A number and one blank (two before a one-word line, as numbering writes them), or a number, colon and
  // blank, go; leading blanks and what followed stay. Lines whose first word is no number stay as they are.
  const std::pair<const char16_t*, const char16_t*> rows[] = {
      {u"10000 x = 1", u"x = 1"},
      {u"10000     x = 1", u"    x = 1"},
      {u"10000  Else", u"Else"},
      {u"10000  \t  Loop  ", u"\t  Loop  "},
      {u"10000  x = 1", u" x = 1"},
      {u"-5 x", u"x"},
      {u"10000 ' nota", u"' nota"},
      {u"10000: x = 1", u"x = 1"},
      {u"  10:   x = 1", u"    x = 1"},
      {u"10000: ", u""},
      {u"\t10000 x", u"\tx"},
      {u"10000\tx", u"x"},
      {u"10000 \t\tx", u"\t\tx"},
      {u"x = 1", nullptr},
      {u"    Else", nullptr},
      {u"Erro: x = 1", nullptr},
      {u"10000", nullptr},
      {u"10. x", nullptr},
      {u"10, x", nullptr},
      {u"' 10 x", nullptr},
      {u"", nullptr},
      {u"   ", nullptr},
      {u"\t", nullptr},
  };
  for (const auto& [text, expected] : rows) {
    const QString line = QString::fromUtf16(text);
    EXPECT_EQ(unnumbered(line, expected != nullptr), expected ? QString::fromUtf16(expected) : line);
  }
}

TEST(UnnumberLineContinuation, ContinuationLinesKeepTheirLeadingNumber) {
  bool continuation = false;
  QString first = QStringLiteral("10000 x = a + _");
  QString second = QStringLiteral("    2 * b + _");
  QString third = QStringLiteral("    3");
  QString next = QStringLiteral("10005 y = 1");
  EXPECT_TRUE(UnnumberLine(first, continuation));
  EXPECT_EQ(first, QStringLiteral("x = a + _"));
  EXPECT_TRUE(continuation);
  EXPECT_FALSE(UnnumberLine(second, continuation));
  EXPECT_EQ(second, QStringLiteral("    2 * b + _"));
  EXPECT_TRUE(continuation);
  EXPECT_FALSE(UnnumberLine(third, continuation));
  EXPECT_FALSE(continuation);
  EXPECT_TRUE(UnnumberLine(next, continuation));
  EXPECT_EQ(next, QStringLiteral("y = 1"));
}

TEST(UnnumberLineContinuation, BlankLineEndsTheContinuation) {
  bool continuation = true;
  QString blank;
  QString numbered = QStringLiteral("10 x");
  EXPECT_FALSE(UnnumberLine(blank, continuation));
  EXPECT_FALSE(continuation);
  EXPECT_TRUE(UnnumberLine(numbered, continuation));
  EXPECT_EQ(numbered, QStringLiteral("x"));
}

TEST(UnnumberLineContinuation, SingleLineRuleAloneTakesAnyLeadingNumber) {
  EXPECT_EQ(unnumbered(QStringLiteral("    2 * b"), true), QStringLiteral("    * b"));
}

// --- Whole procedures ---

TEST(NumberProcedureWalk, NumberingStartsAfterAThreeLineHeader) {
  const QStringList walked = numberProcedure({
      QStringLiteral("Private Function Soma(ByVal a As Long, _"),
      QStringLiteral("                      ByVal b As Long, _"),
      QStringLiteral("                      ByVal c As Long) As Long"),
      QStringLiteral("    Soma = a + b + c"),
      QStringLiteral("End Function"),
  });
  const QStringList expected = {
      QStringLiteral("Private Function Soma(ByVal a As Long, _"),
      QStringLiteral("                      ByVal b As Long, _"),
      QStringLiteral("                      ByVal c As Long) As Long"),
      QStringLiteral("10000     Soma = a + b + c"),
      QStringLiteral("End Function"),
  };
  EXPECT_EQ(walked, expected);
}

TEST(NumberProcedureWalk, TrailingBlankLinesAndTheEndLineAreLeftAlone) {
  const QStringList walked = numberProcedure({
      QStringLiteral("Public Sub Limpar()"),
      QStringLiteral("    x = 0"),
      QStringLiteral("    Else"),
      QStringLiteral("End Sub"),
      QString(),
      QStringLiteral("   "),
  });
  const QStringList expected = {
      QStringLiteral("Public Sub Limpar()"),
      QStringLiteral("10000     x = 0"),
      QStringLiteral("10005      Else"),
      QStringLiteral("End Sub"),
      QString(),
      QStringLiteral("   "),
  };
  EXPECT_EQ(walked, expected);
}

TEST(NumberProcedureWalk, RenumberingReplacesOldNumbersAndRestartsPerProcedure) {
  const QStringList first = numberProcedure({QStringLiteral("Sub A()"), QStringLiteral("10 x = 1"),
                                             QStringLiteral("20: y = 2"), QStringLiteral("End Sub")},
                                            100, 10);
  const QStringList expected = {QStringLiteral("Sub A()"), QStringLiteral("100 x = 1"),
                                QStringLiteral("110 y = 2"), QStringLiteral("End Sub")};
  EXPECT_EQ(first, expected);
  const QStringList second = numberProcedure(
      {QStringLiteral("Sub B()"), QStringLiteral("z = 3"), QStringLiteral("End Sub")}, 100, 10);
  EXPECT_EQ(second[1], QStringLiteral("100 z = 3"));
}

TEST(NumberProcedureWalk, LinesThatJumpsTargetKeepTheirLabels) {
  // Each row: a line and what numbering makes of it. The targets of GoTo, GoSub, Resume, On ... GoTo lists
  // (also continued), and a number after Then or Else stay as they are and take no number; jumps inside
  // strings, comments and Rem, On Error GoTo 0 and Resume 0 protect nothing.
  const std::pair<const char16_t*, const char16_t*> rows[] = {
      {u"Private Sub Ordena(v() As Long)", nullptr},
      {u"    Dim i As Long, u As Long", u"10000     Dim i As Long, u As Long"},
      {u"    On Error GoTo 100", u"10005     On Error GoTo 100"},
      {u"    On k GoSub 10, 020, 30 ' menu", u"10010     On k GoSub 10, 020, 30 ' menu"},
      {u"    For i = 1 To u", u"10015     For i = 1 To u"},
      {u"        If v(i) < u Then goto 1", u"10020         If v(i) < u Then goto 1"},
      {u"        If v(i) = 0 Then 20 Else 30", u"10025         If v(i) = 0 Then 20 Else 30"},
      {u"        Debug.Print \"GoTo 50\": Resume 40 ' GoTo 60", nullptr},
      {u"        Rem Resume 70", u"10035         Rem Resume 70"},
      {u"        On Error GoTo 0: Resume 0", u"10040         On Error GoTo 0: Resume 0"},
      {u"        On k GoTo 1, _", u"10045         On k GoTo 1, _"},
      {u"            110", nullptr},
      {u"1       Next i", nullptr},
      {u"10      s = \"índice\"", nullptr},
      {u"20: x = 2", nullptr},
      {u"30  ' fim", nullptr},
      {u"40", nullptr},
      {u"50      y = 3", u"10050      y = 3"},
      {u"0       Exit Sub", u"10055       Exit Sub"},
      {u"110", nullptr},
      {u"100     Resume Next", nullptr},
      {u"End Sub", nullptr},
  };
  QStringList code;
  QStringList expected;
  for (const auto& [line, numbered] : rows) {
    code << QString::fromUtf16(line);
    expected << QString::fromUtf16(numbered ? numbered : line);
  }
  expected[7] = QStringLiteral("10030 ") + code[7];
  const QStringList numbered = numberProcedure(code);
  EXPECT_EQ(numbered, expected);
  EXPECT_EQ(numberProcedure(numbered), numbered);
  // Removing numbers leaves the targets too: the code comes back as removing them from it gives.
  EXPECT_EQ(unnumberProcedure(numbered), unnumberProcedure(code));
  EXPECT_EQ(unnumberProcedure(code)[12], code[12]);
  EXPECT_EQ(unnumberProcedure(code)[17], QStringLiteral("     y = 3"));
}

TEST(NumberProcedureWalk, RemovingNumbersRestoresTheCode) {
  const QStringList numbered = numberProcedure({
      QStringLiteral("Sub A()"),
      QStringLiteral("    If x Then"),
      QStringLiteral("        y = 1 + _"),
      QStringLiteral("            2"),
      QStringLiteral("    End If"),
      QStringLiteral("End Sub"),
  });
  const QStringList expected = {
      QStringLiteral("Sub A()"),       QStringLiteral("    If x Then"), QStringLiteral("        y = 1 + _"),
      QStringLiteral("            2"), QStringLiteral("    End If"),    QStringLiteral("End Sub"),
  };
  EXPECT_EQ(unnumberProcedure(numbered), expected);
}

}  // namespace
}  // namespace transform
