// SPDX-License-Identifier: MIT
// Tests of splitting a file into lines and joining them back: every kind of line end is kept per line,
// binary content and overlong lines are refused with the file and line named, and any text survives a
// read and a write byte for byte.
#include "host/files/sourcelines.h"

#include "ide/error.h"

#include <gtest/gtest.h>

#include <random>

namespace host {
namespace {

/// Runs `action`, expecting an ide::Error; returns it.
template <typename Action>
ide::Error expectError(Action&& action) {
  try {
    action();
  } catch (const ide::Error& error) {
    return error;
  }
  ADD_FAILURE() << "no ide::Error thrown";
  return ide::Error(0, {});
}

TEST(SourceLinesTest, KeepsEachLinesOwnEnd) {
  const QByteArray bytes("Option Explicit\r\nDim a\nDim b\rDim c\r\n\r\nlast");
  const std::vector<SourceLine> lines = readSourceLines(bytes, QStringLiteral("Module1.bas"));
  ASSERT_EQ(lines.size(), 6u);
  EXPECT_EQ(lines[0].text, u"Option Explicit");
  EXPECT_EQ(lines[0].end, LineEnd::CRLF);
  EXPECT_EQ(lines[1].text, u"Dim a");
  EXPECT_EQ(lines[1].end, LineEnd::LF);
  EXPECT_EQ(lines[2].text, u"Dim b");
  EXPECT_EQ(lines[2].end, LineEnd::CR);
  EXPECT_EQ(lines[3].text, u"Dim c");
  EXPECT_EQ(lines[3].end, LineEnd::CRLF);
  EXPECT_EQ(lines[4].text, u"");
  EXPECT_EQ(lines[4].end, LineEnd::CRLF);
  EXPECT_EQ(lines[5].text, u"last");
  EXPECT_EQ(lines[5].end, LineEnd::None);
  EXPECT_EQ(writeSourceLines(lines, QStringLiteral("Module1.bas")), bytes);
}

TEST(SourceLinesTest, ReadsLineEndsThatFollowEachOther) {
  // LF CR is two line ends (LF, then an empty line ended by CR); CR CR LF is CR then CRLF.
  const QByteArray bytes("a\n\rb\r\r\nc\r");
  const std::vector<SourceLine> lines = readSourceLines(bytes, QStringLiteral("x.bas"));
  ASSERT_EQ(lines.size(), 5u);
  EXPECT_EQ(lines[0].end, LineEnd::LF);
  EXPECT_EQ(lines[1].text, u"");
  EXPECT_EQ(lines[1].end, LineEnd::CR);
  EXPECT_EQ(lines[2].text, u"b");
  EXPECT_EQ(lines[2].end, LineEnd::CR);
  EXPECT_EQ(lines[3].text, u"");
  EXPECT_EQ(lines[3].end, LineEnd::CRLF);
  EXPECT_EQ(lines[4].text, u"c");
  EXPECT_EQ(lines[4].end, LineEnd::CR);
  EXPECT_EQ(writeSourceLines(lines, QStringLiteral("x.bas")), bytes);
}

TEST(SourceLinesTest, LastLineWithoutEnd) {
  const std::vector<SourceLine> lines = readSourceLines("Dim x\r\nx = 1", QStringLiteral("a.bas"));
  ASSERT_EQ(lines.size(), 2u);
  EXPECT_EQ(lines[1].text, u"x = 1");
  EXPECT_EQ(lines[1].end, LineEnd::None);

  const std::vector<SourceLine> ended = readSourceLines("Dim x\r\n", QStringLiteral("a.bas"));
  ASSERT_EQ(ended.size(), 1u) << "a final line end does not start another line";
  EXPECT_EQ(ended[0].end, LineEnd::CRLF);
}

TEST(SourceLinesTest, EmptyFileHasNoLines) {
  EXPECT_TRUE(readSourceLines(QByteArrayView(), QStringLiteral("empty.bas")).empty());
  EXPECT_EQ(writeSourceLines({}, QStringLiteral("empty.bas")), QByteArray());
}

TEST(SourceLinesTest, DecodesAnsiText) {
  const std::vector<SourceLine> lines =
      readSourceLines("' Rotina de impress\xE3o \x96 cabe\xE7\x61lho\r\n", QStringLiteral("a.bas"));
  ASSERT_EQ(lines.size(), 1u);
  EXPECT_EQ(lines[0].text, QString::fromUtf8("' Rotina de impressão – cabeçalho"));
}

TEST(SourceLinesTest, AcceptsTheLongestLineAndRefusesOneMore) {
  const QByteArray longest(kMaxLineLength, 'x');
  const QByteArray bytes = "Option Explicit\r\n" + longest + "\r\n";
  const std::vector<SourceLine> lines = readSourceLines(bytes, QStringLiteral("Module1.bas"));
  ASSERT_EQ(lines.size(), 2u);
  EXPECT_EQ(lines[1].text.size(), 1023);

  const QByteArray tooLong = "Option Explicit\r\n" + QByteArray(kMaxLineLength + 1, 'x') + "\r\nEnd";
  const ide::Error error = expectError([&] { readSourceLines(tooLong, QStringLiteral("Module1.bas")); });
  EXPECT_EQ(error.number(), ide::err::InvalidFileFormat);
  EXPECT_EQ(error.description(), u"Module1.bas, line 2: line longer than 1023 characters");
}

TEST(SourceLinesTest, LengthExcludesTheLineEnd) {
  // 1023 characters followed by CR LF, a lone CR and no end at all.
  const QByteArray text(kMaxLineLength, 'y');
  EXPECT_EQ(readSourceLines(text + "\r\n" + text + "\r" + text, QStringLiteral("a.bas")).size(), 3u);
}

TEST(SourceLinesTest, RefusesAnOverlongLastLineWithoutEnd) {
  const ide::Error error =
      expectError([] { readSourceLines("a\nb\n" + QByteArray(2000, 'z'), QStringLiteral("Form1.frm")); });
  EXPECT_EQ(error.description(), u"Form1.frm, line 3: line longer than 1023 characters");
}

TEST(SourceLinesTest, RefusesBinaryContent) {
  static const char data[] = "VERSION 5.00\r\nBegin VB.Form Form1\r\n\x01\x02\0\x03\r\n";
  const QByteArray bytes(data, sizeof(data) - 1);
  const ide::Error error = expectError([&] { readSourceLines(bytes, QStringLiteral("Form1.frm")); });
  EXPECT_EQ(error.number(), ide::err::InvalidFileFormat);
  EXPECT_EQ(error.description(), u"Form1.frm, line 3: not a text file");
}

TEST(SourceLinesTest, RefusesANulInTheFirstLine) {
  const ide::Error error = expectError([] { readSourceLines(QByteArray("\0", 1), QStringLiteral("b.cls")); });
  EXPECT_EQ(error.description(), u"b.cls, line 1: not a text file");
}

TEST(SourceLinesTest, WritingRefusesCharactersWithoutAnsiCode) {
  const std::vector<SourceLine> lines = {{QStringLiteral("Option Explicit"), LineEnd::CRLF},
                                         {QString::fromUtf16(u"Const Nome = \"\u4E2D\""), LineEnd::CRLF}};
  const ide::Error error = expectError([&] { writeSourceLines(lines, QStringLiteral("Module1.bas")); });
  EXPECT_EQ(error.number(), ide::err::InvalidFileFormat);
  EXPECT_EQ(error.description(),
            u"Module1.bas, line 2: the character U+4E2D in column 15 has no code in the "
            u"ANSI code page");
}

TEST(SourceLinesTest, AppendNumbersTheLineAsTold) {
  QByteArray out("x\r\n");
  appendSourceLine(out, {QStringLiteral("Dim a"), LineEnd::LF}, QStringLiteral("a.bas"), 2);
  EXPECT_EQ(out, QByteArray("x\r\nDim a\n"));
  const ide::Error error = expectError([&] {
    appendSourceLine(out, {QString(QChar(0x0100)), LineEnd::CRLF}, QStringLiteral("a.bas"), 7);
  });
  EXPECT_TRUE(error.description().startsWith(u"a.bas, line 7: the character U+0100 in column 1"));
}

TEST(SourceLinesTest, LineEndBytes) {
  EXPECT_EQ(lineEndBytes(LineEnd::CRLF), QByteArrayView("\r\n"));
  EXPECT_EQ(lineEndBytes(LineEnd::LF), QByteArrayView("\n"));
  EXPECT_EQ(lineEndBytes(LineEnd::CR), QByteArrayView("\r"));
  EXPECT_TRUE(lineEndBytes(LineEnd::None).isEmpty());
}

TEST(SourceLinesTest, RandomTextRoundTripsByteForByte) {
  std::mt19937 random(20240611);
  std::uniform_int_distribution<int> anyByte(1, 255);  // no NUL
  std::uniform_int_distribution<int> pick(0, 9);
  for (int round = 0; round < 200; ++round) {
    QByteArray bytes;
    const int length = std::uniform_int_distribution<int>(0, 3000)(random);
    qsizetype sinceLineEnd = 0;
    for (int i = 0; i < length; ++i) {
      // Line ends often enough that no line reaches the limit.
      char byte = static_cast<char>(anyByte(random));
      if (pick(random) == 0 || sinceLineEnd >= 1000) byte = pick(random) < 5 ? '\n' : '\r';
      bytes.append(byte);
      sinceLineEnd = (byte == '\n' || byte == '\r') ? 0 : sinceLineEnd + 1;
    }
    const std::vector<SourceLine> lines = readSourceLines(bytes, QStringLiteral("random.bas"));
    ASSERT_EQ(writeSourceLines(lines, QStringLiteral("random.bas")), bytes) << "round " << round;
  }
}

TEST(SourceLinesTest, InsertedLinesTakeTheirNeighboursEnd) {
  std::vector<SourceLine> lines = {{QStringLiteral("a"), LineEnd::LF}, {QStringLiteral("b"), LineEnd::None}};
  insertSourceLine(lines, 1, QStringLiteral("between"));
  ASSERT_EQ(lines.size(), 3u);
  EXPECT_EQ(lines[1].text, u"between");
  EXPECT_EQ(lines[1].end, LineEnd::LF);

  // Appended after a last line without end: the new line becomes the last one without end.
  insertSourceLine(lines, 3, QStringLiteral("after"));
  EXPECT_EQ(writeSourceLines(lines, QStringLiteral("x")), QByteArray("a\nbetween\nb\nafter"));

  std::vector<SourceLine> empty;
  insertSourceLine(empty, 0, QStringLiteral("first"));
  ASSERT_EQ(empty.size(), 1u);
  EXPECT_EQ(empty[0].end, LineEnd::CRLF);
  EXPECT_EQ(lineEndAt({{QStringLiteral("only"), LineEnd::None}, {QStringLiteral("x"), LineEnd::CR}}, 1),
            LineEnd::CR);
}

}  // namespace
}  // namespace host
