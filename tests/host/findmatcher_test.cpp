// SPDX-License-Identifier: MIT
// The wildcards of Find against the results of VB's Like operator (text comparison, as Find ignores case
// with wildcards).
#include "host/code/findmatcher.h"
#include "ide/error.h"

#include <gtest/gtest.h>

namespace host {
namespace {

/// `text Like pattern`: the leftmost-longest match covers the whole text exactly when Like is true.
bool like(const QString& text, const QString& pattern) {
  const auto match = FindMatcher(pattern, false, false, true).findIn(text, 0, text.size());
  return match && match->first == 0 && match->second == text.size();
}

struct LikeCase {
  const char16_t* text;
  const char16_t* pattern;
  bool expected;
};

TEST(FindPatterns, FollowTheLikeOperator) {
  const LikeCase cases[] = {
      {u"aBBBa", u"a*a", true},
      {u"F", u"[A-Z]", true},
      {u"F", u"[!A-Z]", false},
      {u"a2a", u"a#a", true},
      {u"aM5b", u"a[L-P]#[!c-e]", true},
      {u"BAT123khg", u"B?T*", true},
      {u"CAT123khg", u"B?T*", false},
      {u"ab", u"a*b", true},
      {u"a*b", u"a[*]b", true},
      {u"axxxxxb", u"a[*]b", false},
      {u"a[xyz", u"a[[]*", true},
      {u"a?c", u"a[?]c", true},
      {u"abc", u"a[?]c", false},
      {u"a#c", u"a[#]c", true},
      {u"a-b", u"a[-]b", true},
      {u"a-b", u"a[b-]b", true},
      {u"a-b", u"a[!-]b", false},
      {u"a!b", u"a!b", true},
      {u"a]b", u"a]b", true},
      {u"!", u"[!]", true},
      {u"ab", u"a[]b", true},
      {u"f", u"[A-Z]", true},  // text comparison: ranges take both cases
      {u"Ç", u"ç", true},
      {u"x", u"[a-c,x-z]", true},
      {u"5", u"[!0-9]", false},
      {u"ac", u"a?c", false},
      {u"a1b2", u"a#b#", true},
      {u"a1bb", u"a#b#", false},
      {u"Valor23", u"Valor#", false},
      {u"Valor23", u"Valor*#", true},
      {u"x", u"*", true},
      {u"abcabc", u"*b*b*", true},
  };
  for (const LikeCase& c : cases) {
    const QString text = QString::fromUtf16(c.text);
    const QString pattern = QString::fromUtf16(c.pattern);
    EXPECT_EQ(like(text, pattern), c.expected) << text.toStdString() << " Like " << pattern.toStdString();
  }
}

TEST(FindPatterns, ABadPatternIsError93) {
  for (const char16_t* pattern : {u"[abc", u"a[", u"[z-a]"}) {
    try {
      FindMatcher(QString::fromUtf16(pattern), false, false, true);
      ADD_FAILURE() << QString::fromUtf16(pattern).toStdString();
    } catch (const ide::Error& error) {
      EXPECT_EQ(error.number(), 93);
      EXPECT_EQ(error.description(), u"Invalid pattern string"_qs);
    }
  }
}

TEST(FindPatterns, TakeTheLeftmostStartThenTheLongestEnd) {
  using Match = std::optional<std::pair<qsizetype, qsizetype>>;
  const QString line = u"If sTexto = \"x\" Then sTexto = sTexto & Valor1"_qs;
  const auto find = [&](const char* pattern, bool wholeWord = false, qsizetype from = 0) {
    return FindMatcher(QString::fromLatin1(pattern), wholeWord, false, true).findIn(line, from, line.size());
  };
  EXPECT_EQ(find("stexto*"), (Match{{3, 45}}));
  EXPECT_EQ(find("t?xto", false, 5), (Match{{22, 27}}));
  EXPECT_EQ(find("*then"), (Match{{0, 20}}));
  // Whole words: the longest end is not the last "o" (inside "Valor1") but the last one ending a word.
  EXPECT_EQ(find("s*o", true), (Match{{3, 36}}));
  EXPECT_EQ(find("exto", true), std::nullopt);
  EXPECT_EQ(find("l?r#"), (Match{{41, 45}}));
}

TEST(FindPatterns, WorkOnTheLongestLineTheIdeAllows) {
  const QString line = QString(1022, u'a') + u'b';
  for (const char* pattern : {"*a*a*a*a*a*a*a*a*c", "a?a?a?a?a?a?a?a?a?a?a?a?c", "*[!a]a"})
    EXPECT_FALSE(FindMatcher(QString::fromLatin1(pattern), false, false, true).findIn(line, 0, line.size()));
  EXPECT_EQ(FindMatcher(u"a*b"_qs, false, false, true).findIn(line, 0, line.size()),
            (std::optional<std::pair<qsizetype, qsizetype>>{{0, 1023}}));
}

}  // namespace
}  // namespace host
