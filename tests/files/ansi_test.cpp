// SPDX-License-Identifier: MIT
// Tests of the Windows-1252 conversion: every byte survives a round trip, the mapping agrees with ICU's
// code page, and characters without a byte are refused with their position.
#include "host/files/ansi.h"

#include <gtest/gtest.h>

#include <QStringDecoder>

namespace host {
namespace {

// Every byte decodes as ICU's Windows-1252 does and encodes back to itself, which covers each accented and
// typographic character the code page holds.
TEST(AnsiTest, EveryByteDecodesAsTheCodePageSaysAndRoundTrips) {
  QByteArray bytes(256, '\0');
  for (int i = 0; i < 256; ++i)
    bytes[i] = static_cast<char>(i);
  QStringDecoder decoder("Windows-1252");
  ASSERT_TRUE(decoder.isValid());
  const QString expected = decoder.decode(bytes);
  ASSERT_FALSE(decoder.hasError());
  const QString text = decodeAnsi(bytes);
  EXPECT_EQ(text, expected);
  ASSERT_EQ(text.size(), 256);
  EXPECT_EQ(encodeAnsi(text), std::optional<QByteArray>(bytes));
}

TEST(AnsiTest, RefusesCharactersWithoutAByteAndReportsTheFirst) {
  qsizetype bad = -1;
  EXPECT_FALSE(encodeAnsi(QString::fromUtf16(u"ab\u4E2Dc\u4E2D"), &bad).has_value());
  EXPECT_EQ(bad, 2);

  bad = -1;
  // U+0080 is a C1 control that the code page does not place at 0x80 (the euro sign is there).
  EXPECT_FALSE(encodeAnsi(QString(QChar(0x0080)), &bad).has_value());
  EXPECT_EQ(bad, 0);

  for (const char16_t character : {u'\u0098', u'\u009F', u'\u0100', u'\u2028', u'\uFFFD'}) {
    EXPECT_FALSE(encodeAnsi(QString(QChar(character))).has_value()) << int(character);
  }

  bad = -1;  // a surrogate pair
  EXPECT_FALSE(encodeAnsi(QString::fromUtf8("x\xF0\x9F\x98\x80"), &bad).has_value());
  EXPECT_EQ(bad, 1);
}

TEST(AnsiTest, AppendKeepsWhatWasThereAndStopsAtTheBadCharacter) {
  QByteArray out("head:");
  EXPECT_TRUE(appendAnsi(out, u"ok"));
  EXPECT_EQ(out, QByteArray("head:ok"));

  qsizetype bad = -1;
  EXPECT_FALSE(appendAnsi(out, QString::fromUtf16(u"ab\u4E2D"), &bad));
  EXPECT_EQ(bad, 2);
  EXPECT_TRUE(out.startsWith("head:ok"));
}

}  // namespace
}  // namespace host
