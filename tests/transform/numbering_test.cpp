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

// --- One line ---

TEST(NumberLineRules, EachKindOfLineIsNumberedOrLeftAsItIs) {
  struct Case {
    const char16_t* text;
    const char16_t* numbered;  // null: unchanged
    bool takesNumber;
    bool continuedAfter = false;
    bool afterContinuedLine = false;
  };
  const Case cases[] = {
      // Blank and comment lines end a continuation, unless the comment itself goes on.
      {u"", nullptr, false, false, true},
      {u"    ", nullptr, false, false, true},
      {u"\t", nullptr, false, false, true},
      {u" \t ", nullptr, false, false, true},
      {u"' nota", nullptr, false, false, true},
      {u"    ' nota", nullptr, false, false, true},
      {u"\t' nota", nullptr, false, false, true},
      {u"'x _", nullptr, false, true, true},
      // Declarations, directives, Case lines, procedure headers and ends get no number.
      {u"Private Const A = 1", nullptr, false},
      {u"    Public X As Long", nullptr, false},
      {u"Friend Function F() As Long", nullptr, false},
      {u"        Case 1", nullptr, false},
      {u"Case Else", nullptr, false},
      {u"Event Changed()", nullptr, false},
      {u"Sub Foo()", nullptr, false},
      {u"Function Bar() As Long", nullptr, false},
      {u"Property Get Nome() As String", nullptr, false},
      {u"#If DEBUG Then", nullptr, false},
      {u"\t#End If", nullptr, false},
      {u"End Sub", nullptr, false},
      {u"End Function", nullptr, false},
      {u"End Property", nullptr, false},
      {u"Private Declare Function GetTickCount Lib \"kernel32\" _", nullptr, false, true},
      {u"        Case 1, 2, _", nullptr, false, true},
      // Keywords are case-sensitive and whole words.
      {u"private_x = 1", u"10000 private_x = 1", true},
      {u"Cases = 2", u"10000 Cases = 2", true},
      // The number, a space and the line's indentation; two spaces before a one-word line.
      {u"    x = 1", u"10000     x = 1", true},
      {u"End If", u"10000 End If", true},
      {u"End Select", u"10000 End Select", true},
      {u"Else", u"10000  Else", true},
      {u"    Loop", u"10000      Loop", true},
      {u"x = 1 + _", u"10000 x = 1 + _", true, true},
      {u"x = 1 + _\t", u"10000 x = 1 + _\t", true, true},  // a trailing tab hides no continuation mark
      // Leading tabs are kept exactly.
      {u"\tx = 1", u"10000 \tx = 1", true},
      {u"\t\tElse", u"10000  \t\tElse", true},
      {u" \tx = 1\t", u"10000  \tx = 1\t", true},
      // A number in front of a comment is dropped, a line holding only a number is emptied.
      {u"10 ' nota", u"' nota", false},
      {u"    10' nota", u"    ' nota", false},
      {u"10", u"", false},
      {u"   10  ", u"", false},
      {u"\t-5", u"", false},
      {u"1.5", u"", false},
      // Text ending in a point or a comma is not a number; colons and quotes in code are no label or comment.
      {u"10.", u"10000  10.", true},
      {u"10. x", u"10000 10. x", true},
      {u"10, x", u"10000 10, x", true},
      {u"10.: x", u"10000 10.: x", true},
      {u"x = a: y = b", u"10000 x = a: y = b", true},
      {u"MsgBox \"it's\"", u"10000 MsgBox \"it's\"", true},
      // A line beginning with a label is never numbered; a keyword with a colon is a statement.
      {u"ErrorHandler:", nullptr, false},
      {u"Erro: x = 1", nullptr, false},
      {u"    Saida:", nullptr, false},
      {u"Ação:", nullptr, false},
      {u"Label_1: ' nota", nullptr, false},
      {u"\tFim:", nullptr, false},
      {u"Else:", u"10000  Else:", true},
      {u"    Else: x = 1", u"10000     Else: x = 1", true},
      {u"End:", u"10000  End:", true},
      {u"Resume: x = 1", u"10000 Resume: x = 1", true},
      {u"else:", u"10000  else:", true},
      {u"Foo x:=1", u"10000 Foo x:=1", true},
      {u"1Erro: x", u"10000 1Erro: x", true},
  };
  for (const Case& sample : cases) {
    const QString text = QString::fromUtf16(sample.text);
    SCOPED_TRACE(text.toStdString());
    const Numbered n = numberOne(text, 9995, sample.afterContinuedLine);
    EXPECT_EQ(n.changed, sample.numbered != nullptr);
    EXPECT_EQ(n.line, sample.numbered ? QString::fromUtf16(sample.numbered) : text);
    EXPECT_EQ(n.number, sample.takesNumber ? 10000 : 9995);
    EXPECT_EQ(n.continuation, sample.continuedAfter);
  }
  const Numbered negative = numberOne(u"x = 1"_qs, -15, false, 5);
  EXPECT_EQ(negative.line, u"-10 x = 1"_qs);
}

// --- Continued statements get one number, on their first line ---

TEST(NumberLineContinuation, StatementOverThreeLinesIsNumberedOnItsFirstLineOnly) {
  qint32 number = 9995;
  bool continuation = false;
  QString first = u"    x = 1 + _"_qs;
  QString second = u"        2 + _"_qs;
  QString third = u"        3"_qs;
  QString next = u"    y = x"_qs;

  EXPECT_TRUE(NumberLine(first, number, continuation, 5));
  EXPECT_EQ(first, u"10000     x = 1 + _"_qs);
  EXPECT_TRUE(continuation);
  EXPECT_FALSE(NumberLine(second, number, continuation, 5));
  EXPECT_EQ(second, u"        2 + _"_qs);
  EXPECT_TRUE(continuation);
  EXPECT_FALSE(NumberLine(third, number, continuation, 5));
  EXPECT_EQ(third, u"        3"_qs);
  EXPECT_FALSE(continuation);
  EXPECT_TRUE(NumberLine(next, number, continuation, 5));
  EXPECT_EQ(next, u"10005     y = x"_qs);
  EXPECT_EQ(number, 10005);
}

TEST(NumberLineContinuation, BlankCommentOrLabelLinesEndOrCarryTheContinuation) {
  // A blank or comment line ends a continuation; a continued statement after a label stays unnumbered.
  EXPECT_EQ(
      numberProcedure(linesOf("Sub A()\nx = 1 + _\n\ny = 2\nz = 3 + _\n\t' nota\nw = 4\n"
                              "' nota longa _\n    que continua\nErro: x = 1 + _\n    2\ny = 3\nEnd Sub")),
      linesOf("Sub A()\n10000 x = 1 + _\n\n10005 y = 2\n10010 z = 3 + _\n\t' nota\n10015 w = 4\n"
              "' nota longa _\n    que continua\nErro: x = 1 + _\n    2\n10020 y = 3\nEnd Sub"));
}

// --- How a number goes in ---

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

// --- Running numbers never wrap ---

TEST(NumberLineOverflow, LastRepresentableNumberIsWritten) {
  const Numbered n = numberOne(u"x = 1"_qs, kMax - 5, false, 5);
  EXPECT_EQ(n.line, u"2147483647 x = 1"_qs);
  EXPECT_EQ(n.number, kMax);
}

TEST(NumberLineOverflow, PassingEitherLimitThrowsAnObjectModelOverflowAndChangesNothing) {
  struct Case {
    const char* text;
    qint32 number;
    qint32 interval;
  };
  for (const Case& sample :
       {Case{"    x = 1 + _", kMax - 4, 5}, Case{"Else", kMin + 2, -5}, Case{"10: x = 1", kMax, 1}}) {
    QString line = QString::fromUtf8(sample.text);
    qint32 number = sample.number;
    bool continuation = false;
    try {
      NumberLine(line, number, continuation, sample.interval);
      ADD_FAILURE() << "no overflow reported: " << sample.text;
    } catch (const LineNumberOverflow& error) {
      EXPECT_EQ(error.number(), 6);
      EXPECT_EQ(error.description(), u"Overflow"_qs);
    }
    EXPECT_EQ(line, QString::fromUtf8(sample.text));
    EXPECT_EQ(number, sample.number);
    EXPECT_FALSE(continuation);
  }
}

TEST(NumberLineOverflow, LinesThatTakeNoNumberDoNotOverflow) {
  Numbered n = numberOne(u"10 ' nota"_qs, kMax);
  EXPECT_EQ(n.line, u"' nota"_qs);
  n = numberOne(u"Case 1"_qs, kMax);
  EXPECT_FALSE(n.changed);
  n = numberOne(u"10"_qs, kMax);
  EXPECT_EQ(n.line, QString());
  EXPECT_EQ(n.number, kMax);
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
  QString first = u"10000 x = a + _"_qs;
  QString second = u"    2 * b + _"_qs;
  QString third = u"    3"_qs;
  QString next = u"10005 y = 1"_qs;
  EXPECT_TRUE(UnnumberLine(first, continuation));
  EXPECT_EQ(first, u"x = a + _"_qs);
  EXPECT_TRUE(continuation);
  EXPECT_FALSE(UnnumberLine(second, continuation));
  EXPECT_EQ(second, u"    2 * b + _"_qs);
  EXPECT_TRUE(continuation);
  EXPECT_FALSE(UnnumberLine(third, continuation));
  EXPECT_FALSE(continuation);
  EXPECT_TRUE(UnnumberLine(next, continuation));
  EXPECT_EQ(next, u"y = 1"_qs);
}

TEST(UnnumberLineContinuation, BlankLineEndsTheContinuationAndTheSingleLineRuleTakesAnyNumber) {
  bool continuation = true;
  QString blank;
  QString numbered = u"10 x"_qs;
  EXPECT_FALSE(UnnumberLine(blank, continuation));
  EXPECT_FALSE(continuation);
  EXPECT_TRUE(UnnumberLine(numbered, continuation));
  EXPECT_EQ(numbered, u"x"_qs);
  EXPECT_EQ(unnumbered(u"    2 * b"_qs, true), u"    * b"_qs);
}

// --- Whole procedures ---

TEST(NumberProcedureWalk, NumbersTheBodyBetweenAContinuedHeaderAndTheEndLine) {
  // Trailing blank lines and the End line are left alone.
  EXPECT_EQ(
      numberProcedure(
          linesOf("Private Function Soma(ByVal a As Long, _\n    ByVal b As Long, _\n"
                  "    ByVal c As Long) As Long\n    Soma = a + b + c\n    Else\nEnd Function\n\n   ")),
      linesOf(
          "Private Function Soma(ByVal a As Long, _\n    ByVal b As Long, _\n    ByVal c As Long) As Long\n"
          "10000     Soma = a + b + c\n10005      Else\nEnd Function\n\n   "));
}

TEST(NumberProcedureWalk, RenumberingReplacesOldNumbersAndRestartsPerProcedure) {
  EXPECT_EQ(numberProcedure(linesOf("Sub A()\n10 x = 1\n20: y = 2\nEnd Sub"), 100, 10),
            linesOf("Sub A()\n100 x = 1\n110 y = 2\nEnd Sub"));
  EXPECT_EQ(numberProcedure(linesOf("Sub B()\nz = 3\nEnd Sub"), 100, 10)[1], u"100 z = 3"_qs);
}

TEST(NumberProcedureWalk, LinesThatJumpsTargetKeepTheirLabels) {
  // Each row: a line and what numbering makes of it. The targets of GoTo, GoSub, Resume, On ... GoTo lists
  // (also continued), and a number after Then or Else stay as they are and take no number (nor does a Rem
  // line, a comment); jumps inside strings, comments and Rem, On Error GoTo 0 and Resume 0 protect nothing.
  const std::pair<const char16_t*, const char16_t*> rows[] = {
      {u"Private Sub Ordena(v() As Long)", nullptr},
      {u"    Dim i As Long, u As Long", u"10000     Dim i As Long, u As Long"},
      {u"    On Error GoTo 100", u"10005     On Error GoTo 100"},
      {u"    On k GoSub 10, 020, 30 ' menu", u"10010     On k GoSub 10, 020, 30 ' menu"},
      {u"    For i = 1 To u", u"10015     For i = 1 To u"},
      {u"        If v(i) < u Then goto 1", u"10020         If v(i) < u Then goto 1"},
      {u"        If v(i) = 0 Then 20 Else 30", u"10025         If v(i) = 0 Then 20 Else 30"},
      {u"        Debug.Print \"GoTo 50\": Resume 40 ' GoTo 60", nullptr},
      {u"        Rem Resume 70", nullptr},
      {u"        On Error GoTo 0: Resume 0", u"10035         On Error GoTo 0: Resume 0"},
      {u"        On k GoTo 1, _", u"10040         On k GoTo 1, _"},
      {u"            110", nullptr},
      {u"1       Next i", nullptr},
      {u"10      s = \"índice\"", nullptr},
      {u"20: x = 2", nullptr},
      {u"30  ' fim", nullptr},
      {u"40", nullptr},
      {u"50      y = 3", u"10045      y = 3"},
      {u"0       Exit Sub", u"10050       Exit Sub"},
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
  expected[7] = u"10030 "_qs + code[7];
  const QStringList numbered = numberProcedure(code);
  EXPECT_EQ(numbered, expected);
  EXPECT_EQ(numberProcedure(numbered), numbered);
  // Removing numbers leaves the targets too: the code comes back as removing them from it gives.
  EXPECT_EQ(unnumberProcedure(numbered), unnumberProcedure(code));
  EXPECT_EQ(unnumberProcedure(code)[12], code[12]);
  EXPECT_EQ(unnumberProcedure(code)[17], u"     y = 3"_qs);
}

}  // namespace
}  // namespace transform
