// SPDX-License-Identifier: MIT
// Reading the numbering and indentation choices kept in the settings, and the numbers typed in boxes.
#include "transform/options.h"

#include <gtest/gtest.h>

#include <QTemporaryDir>

namespace transform {
namespace {

TEST(WholeNumber, TakesPlainDecimalNumbersRoundedHalfToEven) {
  EXPECT_EQ(wholeNumber(u"10000"), 10000);
  EXPECT_EQ(wholeNumber(u"  42 "), 42);
  EXPECT_EQ(wholeNumber(u"-5"), -5);
  EXPECT_EQ(wholeNumber(u"2.5"), 2);
  EXPECT_EQ(wholeNumber(u"3.5"), 4);
  EXPECT_EQ(wholeNumber(u"2147483647"), 2147483647);
  EXPECT_EQ(wholeNumber(u"-2147483648"), -2147483647 - 1);
}

TEST(WholeNumber, RefusesWhatIsNotANumberOrDoesNotFit) {
  for (const char16_t* text : {u"", u"  ", u"dez", u"12a", u"1e3", u"&H10", u"2147483648", u"-2147483649"})
    EXPECT_FALSE(wholeNumber(text).has_value()) << QString::fromUtf16(text).toStdString();
}

TEST(StoredOptions, StoredValuesAreReadAndUnusableOnesFallBack) {
  QTemporaryDir dir;
  common::SettingsStore settings(dir.filePath(u"Quimbel.ini"_qs));
  settings.setValue(common::setting::InitialNumber, u"100"_qs);
  settings.setValue(common::setting::Interval, u"cinco"_qs);
  settings.setValue(common::setting::UseOption, u"1"_qs);
  settings.setValue(common::setting::Indentation, u"4"_qs);
  EXPECT_EQ(storedNumbering(settings).startNumber, 100);
  EXPECT_EQ(storedNumbering(settings).interval, 5);
  EXPECT_EQ(storedIndentation(settings).mode, IndentMode::Spaces);
  EXPECT_EQ(storedIndentation(settings).spaces, 4);

  settings.setValue(common::setting::Indentation, u"0"_qs);
  settings.setValue(common::setting::UseOption, QString());
  EXPECT_EQ(storedIndentation(settings).spaces, 3);
  EXPECT_EQ(storedIndentation(settings).mode, IndentMode::Tabs);  // an empty choice counts as tabs
}

}  // namespace
}  // namespace transform
