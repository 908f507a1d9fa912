// SPDX-License-Identifier: MIT
// Tests of the Windows-1252 conversion: every byte survives a round trip, the mapping agrees with ICU's
// code page, and characters without a byte are refused with their position.
#include "host/files/ansi.h"

#include <gtest/gtest.h>

#include <QStringDecoder>

namespace host {
namespace {

QByteArray allBytes() {
  QByteArray bytes(256, '\0');
  for (int i = 0; i < 256; ++i)
    bytes[i] = static_cast<char>(i);
  return bytes;
}

TEST(AnsiTest, EveryByteRoundTrips) {
  const QByteArray bytes = allBytes();
  const QString text = decodeAnsi(bytes);
  ASSERT_EQ(text.size(), 256);
  const std::optional<QByteArray> encoded = encodeAnsi(text);
  ASSERT_TRUE(encoded.has_value());
  EXPECT_EQ(*encoded, bytes);
}

TEST(AnsiTest, DecodingAgreesWithTheSystemCodePage) {
  QStringDecoder decoder("Windows-1252");
  ASSERT_TRUE(decoder.isValid());
  const QByteArray bytes = allBytes();
  const QString expected = decoder.decode(bytes);
  ASSERT_FALSE(decoder.hasError());
  EXPECT_EQ(decodeAnsi(bytes), expected);
}

TEST(AnsiTest, DecodesKnownCharacters) {
  EXPECT_EQ(decodeAnsi("\x80"), QString(QChar(0x20AC)));
  EXPECT_EQ(decodeAnsi("\x93\x94"), QString::fromUtf16(u"\u201C\u201D"));
  EXPECT_EQ(decodeAnsi("\x9F"), QString(QChar(0x0178)));
  EXPECT_EQ(decodeAnsi("Coment\xE1rio \xE7\xE3o"), QString::fromUtf8("Comentário ção"));
  EXPECT_EQ(decodeAnsi(""), QString());
}

TEST(AnsiTest, EncodesTypographicCharactersToTheirBytes) {
  EXPECT_EQ(encodeAnsi(QString::fromUtf16(u"\u20AC\u2026\u2122\u0152")), QByteArray("\x80\x85\x99\x8C"));
  EXPECT_EQ(encodeAnsi(QString::fromUtf8("é ç ã ÿ")), QByteArray("\xE9 \xE7 \xE3 \xFF"));
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
