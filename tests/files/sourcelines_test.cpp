// SPDX-License-Identifier: MIT
// Tests of splitting a file into lines and joining them back: every kind of line end is kept per line,
// binary content and overlong lines are refused with the file and line named, and any text survives a
// read and a write byte for byte.
#include "host/files/sourcelines.h"

#include "testtext.h"

#include <gtest/gtest.h>

#include <random>

namespace host {
namespace {

using testing::expectError;

// Each line keeps its own end, and the lines write back as the bytes they were read from.
TEST(SourceLinesTest, KeepsEachLinesOwnEnd) {
  using Lines = std::vector<std::pair<QString, LineEnd>>;
  const std::pair<QByteArray, Lines> cases[] = {
      {"Option Explicit\r\nDim a\nDim b\rDim c\r\n\r\nlast",
       {{"Option Explicit", LineEnd::CRLF},
        {"Dim a", LineEnd::LF},
        {"Dim b", LineEnd::CR},
        {"Dim c", LineEnd::CRLF},
        {"", LineEnd::CRLF},
        {"last", LineEnd::None}}},
      // LF CR is two line ends (LF, then an empty line ended by CR); CR CR LF is CR then CRLF.
      {"a\n\rb\r\r\nc\r",
       {{"a", LineEnd::LF}, {"", LineEnd::CR}, {"b", LineEnd::CR}, {"", LineEnd::CRLF}, {"c", LineEnd::CR}}},
      // A final line end does not start another line.
      {"Dim x\r\n", {{"Dim x", LineEnd::CRLF}}},
      {"", {}},
      {"' Rotina de impress\xE3o \x96 cabe\xE7\x61lho\r\n",
       {{QString::fromUtf8("' Rotina de impressão – cabeçalho"), LineEnd::CRLF}}},
  };
  for (const auto& [bytes, expected] : cases) {
    SCOPED_TRACE(bytes.toStdString());
    const std::vector<SourceLine> lines = readSourceLines(bytes, u"Module1.bas"_qs);
    Lines read;
    for (const SourceLine& line : lines)
      read.emplace_back(line.text, line.end);
    EXPECT_EQ(read, expected);
    EXPECT_EQ(writeSourceLines(lines, u"Module1.bas"_qs), bytes);
  }
}

TEST(SourceLinesTest, AcceptsTheLongestLineWhateverItsEnd) {
  const QByteArray longest(kMaxLineLength, 'y');
  const std::vector<SourceLine> lines =
      readSourceLines(longest + "\r\n" + longest + "\r" + longest, u"a.bas"_qs);
  ASSERT_EQ(lines.size(), 3u);
  EXPECT_EQ(lines[2].text.size(), 1023);
}

TEST(SourceLinesTest, RefusesOverlongLinesAndBinaryContentNamingTheFileAndLine) {
  const std::pair<QByteArray, const char*> cases[] = {
      {"Option Explicit\r\n" + QByteArray(kMaxLineLength + 1, 'x') + "\r\nEnd",
       "Module1.bas, line 2: line longer than 1023 characters"},
      {"a\nb\n" + QByteArray(2000, 'z'), "Module1.bas, line 3: line longer than 1023 characters"},
      {QByteArray("VERSION 5.00\r\nBegin VB.Form Form1\r\n\x01\x02\0\x03\r\n", 41),
       "Module1.bas, line 3: not a text file"},
      {QByteArray("\0", 1), "Module1.bas, line 1: not a text file"},
  };
  for (const auto& [bytes, description] : cases) {
    const ide::Error error = expectError([&] { readSourceLines(bytes, u"Module1.bas"_qs); });
    EXPECT_EQ(error.number(), ide::err::InvalidFileFormat);
    EXPECT_EQ(error.description(), QString::fromUtf8(description));
  }
}

TEST(SourceLinesTest, WritingRefusesCharactersWithoutAnsiCode) {
  const std::vector<SourceLine> lines = {{u"Option Explicit"_qs, LineEnd::CRLF},
                                         {QString::fromUtf16(u"Const Nome = \"\u4E2D\""), LineEnd::CRLF}};
  const ide::Error error = expectError([&] { writeSourceLines(lines, u"Module1.bas"_qs); });
  EXPECT_EQ(error.number(), ide::err::InvalidFileFormat);
  EXPECT_EQ(error.description(),
            u"Module1.bas, line 2: the character U+4E2D in column 15 has no code in the "
            u"ANSI code page");
}

TEST(SourceLinesTest, AppendNumbersTheLineAsTold) {
  QByteArray out("x\r\n");
  appendSourceLine(out, {u"Dim a"_qs, LineEnd::LF}, u"a.bas"_qs, 2);
  EXPECT_EQ(out, QByteArray("x\r\nDim a\n"));
  const ide::Error error = expectError([&] {
    appendSourceLine(out, {QString(QChar(0x0100)), LineEnd::CRLF}, u"a.bas"_qs, 7);
  });
  EXPECT_TRUE(error.description().startsWith(u"a.bas, line 7: the character U+0100 in column 1"));
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
    const std::vector<SourceLine> lines = readSourceLines(bytes, u"random.bas"_qs);
    ASSERT_EQ(writeSourceLines(lines, u"random.bas"_qs), bytes) << "round " << round;
  }
}

TEST(SourceLinesTest, InsertedLinesTakeTheirNeighboursEnd) {
  std::vector<SourceLine> lines = {{u"a"_qs, LineEnd::LF}, {u"b"_qs, LineEnd::None}};
  insertSourceLine(lines, 1, u"between"_qs);
  ASSERT_EQ(lines.size(), 3u);
  EXPECT_EQ(lines[1].text, u"between");
  EXPECT_EQ(lines[1].end, LineEnd::LF);

  // Appended after a last line without end: the new line becomes the last one without end.
  insertSourceLine(lines, 3, u"after"_qs);
  EXPECT_EQ(writeSourceLines(lines, u"x"_qs), QByteArray("a\nbetween\nb\nafter"));

  std::vector<SourceLine> empty;
  insertSourceLine(empty, 0, u"first"_qs);
  ASSERT_EQ(empty.size(), 1u);
  EXPECT_EQ(empty[0].end, LineEnd::CRLF);
  EXPECT_EQ(lineEndAt({{u"only"_qs, LineEnd::None}, {u"x"_qs, LineEnd::CR}}, 1), LineEnd::CR);
}

}  // namespace
}  // namespace host
