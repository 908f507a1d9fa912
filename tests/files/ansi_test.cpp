// SPDX-License-Identifier: MIT
// Tests of the Windows-1252 conversion: every byte survives a round trip, the mapping agrees with ICU's
// code page, and characters without a byte are refused with their position.
#include "host/files/ansi.h"

#include <gtest/gtest.h>

#include <QRandomGenerator>
#include <QStringDecoder>

#include <algorithm>

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

  // Long texts are narrowed a block at a time: letters above 0x7F and a bad character far into the text.
  const QString accents = QString(300, u'a') + QString::fromUtf8("ç€") + QString(300, u'b');
  EXPECT_EQ(encodeAnsi(accents), QByteArray(300, 'a') + "\xE7\x80" + QByteArray(300, 'b'));
  bad = -1;
  EXPECT_FALSE(encodeAnsi(accents + QChar(0x4E2D), &bad).has_value());
  EXPECT_EQ(bad, 602);
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

// In UTF-8 mode any bytes come back as they were, valid UTF-8 reads as UTF-8, and only valid UTF-8 with a
// byte above 0x7F looks like UTF-8.
TEST(AnsiTest, Utf8ModeKeepsEveryByteAndReadsValidUtf8AsUtf8) {
  const SourceEncoding before = setSourceEncoding(SourceEncoding::Utf8);
  QRandomGenerator random(23);
  for (int round = 0; round < 2000; ++round) {
    QByteArray bytes(random.bounded(12), '\0');
    for (char& byte : bytes)  // mostly the bytes of UTF-8 sequences, so that valid ones are common
      byte = char(random.bounded(4) ? 0x80 + random.bounded(0x78) : random.bounded(256));
    const QString text = decodeAnsi(bytes);
    EXPECT_EQ(encodeAnsi(text), std::optional(bytes)) << bytes.toHex().toStdString();
    QStringDecoder utf8(QStringDecoder::Utf8,
                        QStringDecoder::Flag::Stateless | QStringDecoder::Flag::ConvertInitialBom);
    const QString strict = utf8.decode(bytes);
    const bool wide = std::any_of(bytes.begin(), bytes.end(), [](char byte) { return byte & 0x80; });
    EXPECT_EQ(looksLikeUtf8(bytes), wide && !utf8.hasError()) << bytes.toHex().toStdString();
    if (!utf8.hasError()) {
      EXPECT_EQ(text, strict);
    }
  }
  EXPECT_TRUE(looksLikeUtf8("a\xC3\xA7\xF0\x9F\x98\x80"));
  for (const char* notUtf8 : {"abc", "\xE7", "\xC0\x80", "\xED\xA0\x80", "\xF4\x90\x80\x80", "\xC3"})
    EXPECT_FALSE(looksLikeUtf8(notUtf8)) << notUtf8;
  qsizetype bad = -1;
  EXPECT_FALSE(encodeAnsi(QString(QChar(0xD800)), &bad));
  EXPECT_EQ(bad, 0);
  setSourceEncoding(before);
}

}  // namespace
}  // namespace host
