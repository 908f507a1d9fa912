// SPDX-License-Identifier: MIT
// Blanks, trimming, continuation marks and the number test shared by numbering and indentation.
#include "transform/linetext.h"

#include "printers.h"

#include <gtest/gtest.h>

namespace transform {
namespace {

TEST(LineText, BlanksAreSpacesAndTabs) {
  EXPECT_TRUE(isBlank(u'\t'));
  EXPECT_FALSE(isBlank(u'\u00a0'));
  EXPECT_EQ(leadingBlanks(u" \t  x = 1 ").toString(), u" \t  "_qs);
  EXPECT_EQ(trimmedView(u"\t  x = 1 \t").toString(), u"x = 1"_qs);
  EXPECT_EQ(rightTrimmedView(u"  x \t").toString(), u"  x"_qs);
  EXPECT_TRUE(isBlankLine(u" \t "));
  EXPECT_FALSE(isBlankLine(u"\t'"));
  EXPECT_EQ(indexOfBlank(u"10\tx = 1"), 2);
  EXPECT_EQ(indexOfBlank(u"Else"), -1);
}

TEST(LineText, SpaceUnderscoreAtTheEndContinues) {
  EXPECT_TRUE(endsWithContinuation(u"x = 1 + _"));
  EXPECT_FALSE(endsWithContinuation(u"x = a_"));
  EXPECT_FALSE(endsWithContinuation(u"_"));
  EXPECT_TRUE(isContinued(u"Private Sub Foo(ByVal a As Long, _  \t"));
}

TEST(LineText, PlainDecimalsWithSignPointAndBlanksAreNumeric) {
  for (const char16_t* text :
       {u"10", u"0", u"  10  ", u"\t10\t", u"-5", u"+5", u"1.5", u".5", u"-0.25", u"10."})
    EXPECT_TRUE(isNumeric(text)) << QString::fromUtf16(text).toStdString();
  for (const char16_t* text : {u"", u"  ", u"+", u"-", u".", u"1e5", u"&H10", u"1,000", u"1,5", u"$5", u"(5)",
                               u"1 0", u"- 5", u"--5", u"1.2.3", u"x10", u"10x", u"10:"})
    EXPECT_FALSE(isNumeric(text)) << QString::fromUtf16(text).toStdString();
}

TEST(LineText, UsableNumberNeverEndsWithPointOrComma) {
  EXPECT_TRUE(isUsableNumber(u"10000"));
  EXPECT_TRUE(isUsableNumber(u"10 "));
  EXPECT_TRUE(isUsableNumber(u"1.5"));
  EXPECT_FALSE(isUsableNumber(u"10."));
  EXPECT_FALSE(isUsableNumber(u"10,"));
  EXPECT_FALSE(isUsableNumber(u""));
  EXPECT_FALSE(isUsableNumber(u"Else"));
}

}  // namespace
}  // namespace transform
