// SPDX-License-Identifier: MIT
// What a line is: one table of line shapes, each rule once, read as text and as Windows-1252 bytes.
#include "syntax/line.h"
#include "syntax/keywords.h"

#include "printers.h"

#include <QStringEncoder>

#include <gtest/gtest.h>

namespace syntax {
namespace {

using Form = NumberPrefix::Form;

struct Shape {
  const char16_t* line;
  Kind kind;
  bool continues = false;
  qsizetype comment = -1;  // where the comment starts
  Form number = Form::None;
  bool label = false;
  bool scoped = false;
};

// Blanks are spaces or tabs, both written out.
const Shape kShapes[] = {
    {u"", Kind::Blank},
    {u" \t ", Kind::Blank},
    {u"' note", Kind::Comment, false, 0},
    {u"\t' it's _", Kind::Comment, true, 1},
    {u"Rem note _", Kind::Comment, true, 0},
    {u"Rem", Kind::Comment, false, 0},
    {u"Remark = 1", Kind::Code},
    {u"x = 1 + _", Kind::Code, true},
    {u"x = 1 +\t_", Kind::Code, true},
    {u"x = 1 + _ \t", Kind::Code, true},
    {u"    _", Kind::Code, true},
    {u"_", Kind::Code, true},
    {u"x = a_", Kind::Code},
    {u"s = \"it's _\"", Kind::Code},
    {u"s = \"a\" & b ' c \"d\" _", Kind::Code, true, 12},
    {u"s = \"\"\"\" ' q", Kind::Code, false, 9},
    {u"x = 1: Rem done", Kind::Code, false, 7},
    {u"10 Rem done", Kind::Code, false, 3, Form::Blank},
    {u"10 x = 1", Kind::Code, false, -1, Form::Blank},
    {u"10: x = 1", Kind::Code, false, -1, Form::Colon},
    {u"10:x", Kind::Code, false, -1, Form::Colon},
    {u"10'x", Kind::Code, false, 2, Form::Comment},
    {u"10", Kind::Code, false, -1, Form::Alone},
    {u"-5 x", Kind::Code, false, -1, Form::Blank},
    {u"10. x", Kind::Code},
    {u"10x = 1", Kind::Code},
    {u": x = 1", Kind::Code},
    {u"ErrorHandler:", Kind::Code, false, -1, Form::None, true},
    {u"ModificadorDaño: x = 1", Kind::Code, false, -1, Form::None, true},
    {u"Else:", Kind::Else},
    {u"x:= 1", Kind::Code},
    {u"Attribute VB_Name = \"M\"", Kind::Attribute},
    {u"Sub Main()", Kind::ProcHeader},
    {u"Private Function Soma(ByVal a As Long) As Long", Kind::ProcHeader, false, -1, Form::None, false, true},
    {u"public static property get Item( _", Kind::ProcHeader, true, -1, Form::None, false, true},
    {u"Friend Property Let X(v)", Kind::ProcHeader, false, -1, Form::None, false, true},
    {u"Public Sub Render(ByVal d As Device): End Sub", Kind::ProcHeader, false, -1, Form::None, false, true},
    {u"End Sub", Kind::ProcEnd},
    {u"end function ' x", Kind::ProcEnd, false, 13},
    {u"End", Kind::Code},
    {u"sUB As Long", Kind::Code},
    {u"Type As Byte", Kind::Code},
    {u"Function = 2", Kind::Code},
    {u"Private sUB As Long, Function(3) As Long", Kind::Variable, false, -1, Form::None, false, true},
    {u"Dim SUB As QSStack", Kind::Variable},
    {u"Static n As Long", Kind::Variable},
    {u"Public Const X = 1", Kind::Const, false, -1, Form::None, false, true},
    {u"Const Y = 2", Kind::Const},
    {u"Public Event Done()", Kind::Event, false, -1, Form::None, false, true},
    {u"Private Declare Function F Lib \"k\" ()", Kind::Declare, false, -1, Form::None, false, true},
    {u"Private Type QSStack", Kind::TypeBegin, false, -1, Form::None, false, true},
    {u"Enum Cores", Kind::EnumBegin},
    {u"End Type", Kind::TypeEnd},
    {u"End Enum", Kind::EnumEnd},
    {u"If x Then", Kind::If},
    {u"If(x) Then y = 1", Kind::If},
    {u"ElseIf x Then", Kind::ElseIf},
    {u"Else", Kind::Else},
    {u"Elsewhere = 1", Kind::Code},
    {u"End If", Kind::EndIf},
    {u"Select Case x", Kind::SelectCase},
    {u"Case Else", Kind::Case},
    {u"End Select", Kind::EndSelect},
    {u"With rs", Kind::With},
    {u"End With", Kind::EndWith},
    {u"For i = 1 To 2", Kind::For},
    {u"Next i", Kind::Next},
    {u"Nextx = 1", Kind::Code},
    {u"Do While x", Kind::Do},
    {u"DoEvents", Kind::Code},
    {u"Loop Until x", Kind::Loop},
    {u"While x", Kind::While},
    {u"Wend", Kind::Wend},
    {u"#If DEBUG Then", Kind::DirectiveIf},
    {u"#ElseIf X Then", Kind::DirectiveElseIf},
    {u"#Else", Kind::DirectiveElse},
    {u"#End If", Kind::DirectiveEndIf},
    {u"#Const DEBUG = 1", Kind::Directive},
};

QByteArray ansi(QStringView text) {
  QStringEncoder encoder("Windows-1252");
  return encoder.encode(text);
}

TEST(LineShapes, EachRuleOnceAsTextAndAsBytes) {
  for (const Shape& shape : kShapes) {
    const QStringView line(shape.line);
    SCOPED_TRACE(line.toString().toStdString());
    const QStringView t = trimmedView(line);
    EXPECT_EQ(classify(line).kind, shape.kind);
    EXPECT_EQ(classify(line).scoped, shape.scoped);
    EXPECT_EQ(continues(line), shape.continues);
    EXPECT_EQ(commentStart(line), shape.comment);
    EXPECT_EQ(numberPrefix(t).form, shape.number);
    EXPECT_EQ(beginsWithLabel(t), shape.label);
    // Tools that scan files as bytes read the same shapes.
    const QByteArray bytes = ansi(line);
    EXPECT_EQ(classify(QByteArrayView(bytes)).kind, shape.kind);
    EXPECT_EQ(continues(QByteArrayView(bytes)), shape.continues);
  }
}

TEST(LineShapes, ALineAfterAContinuedCommentIsComment) {
  Carry carry;
  const std::pair<const char16_t*, Carry> lines[] = {
      {u"x = 1 ' a _", {true, true}},  // the comment goes on
      {u"  b \"c _", {true, true}},    // comment text: its quote opens no string
      {u"  d", {false, false}},       {u"y = a + _", {true, false}}, {u"  b ' e", {false, false}},
  };
  for (const auto& [line, expected] : lines) {
    SCOPED_TRACE(QString::fromUtf16(line).toStdString());
    EXPECT_EQ(commentStart(line, carry.inComment) >= 0, carry.inComment || QStringView(line).contains(u'\''));
    carry = carryAfter(line, carry);
    EXPECT_EQ(carry.continued, expected.continued);
    EXPECT_EQ(carry.inComment, expected.inComment);
  }
}

TEST(LineShapes, TokensTellWordsStringsAndComments) {
  const QStringView line = u"10 If a.Print Then s = \"x'y\" Else n = 1.5: Rem z";
  std::vector<std::pair<Token::Type, QString>> tokens;
  Tokenizer tokenizer(line);
  Token token;
  std::vector<bool> starts;
  while (tokenizer.next(token)) {
    tokens.emplace_back(token.type, line.sliced(token.start, token.length).toString());
    starts.push_back(token.statementStart);
    EXPECT_EQ(token.afterDot, tokens.back().second == u"Print");
  }
  using T = Token::Type;
  const std::vector<std::pair<Token::Type, QString>> expected = {
      {T::Number, u"10"_qs},      {T::Word, u"If"_qs},   {T::Word, u"a"_qs},       {T::Other, u"."_qs},
      {T::Word, u"Print"_qs},     {T::Word, u"Then"_qs}, {T::Word, u"s"_qs},       {T::Other, u"="_qs},
      {T::String, u"\"x'y\""_qs}, {T::Word, u"Else"_qs}, {T::Word, u"n"_qs},       {T::Other, u"="_qs},
      {T::Number, u"1.5"_qs},     {T::Colon, u":"_qs},   {T::Comment, u"Rem z"_qs}};
  EXPECT_EQ(tokens, expected);
  // The line number leaves the statement to the If; the Rem after the colon starts one.
  EXPECT_TRUE(starts[0] && starts[1] && !starts[2] && starts.back());
}

TEST(LineShapes, KeywordsIgnoreLetterCase) {
  EXPECT_TRUE(isReservedWord(u"ELSE"));
  EXPECT_FALSE(isReservedWord(u"Print"));
  EXPECT_TRUE(isColouredKeyword(u"print"));
  EXPECT_FALSE(isColouredKeyword(u"Rem"));
  EXPECT_FALSE(isColouredKeyword(u"Elsé"));
}

}  // namespace
}  // namespace syntax
