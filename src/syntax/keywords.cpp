// SPDX-License-Identifier: MIT
#include "syntax/keywords.h"

#include "syntax/text.h"

#include <algorithm>
#include <iterator>

namespace syntax {
namespace {

enum : unsigned char { kReserved = 1, kColoured = 2 };

struct Keyword {
  QStringView word;
  unsigned char flags;
};

// Sorted without regard to letter case, for the binary search.
constexpr Keyword kKeywords[] = {
    {u"AddressOf", kColoured},
    {u"Alias", kColoured},
    {u"And", kReserved | kColoured},
    {u"Any", kColoured},
    {u"As", kReserved | kColoured},
    {u"Base", kColoured},
    {u"Beep", kReserved},
    {u"Binary", kColoured},
    {u"Boolean", kReserved | kColoured},
    {u"ByRef", kReserved | kColoured},
    {u"Byte", kReserved | kColoured},
    {u"ByVal", kReserved | kColoured},
    {u"Call", kReserved | kColoured},
    {u"Case", kReserved | kColoured},
    {u"CBool", kColoured},
    {u"CByte", kColoured},
    {u"CCur", kColoured},
    {u"CDate", kColoured},
    {u"CDbl", kColoured},
    {u"CDec", kColoured},
    {u"CInt", kColoured},
    {u"CLng", kColoured},
    {u"Close", kReserved | kColoured},
    {u"Compare", kColoured},
    {u"Const", kReserved | kColoured},
    {u"CSng", kColoured},
    {u"CStr", kColoured},
    {u"Currency", kReserved | kColoured},
    {u"CVar", kColoured},
    {u"Date", kReserved | kColoured},
    {u"Debug", kColoured},
    {u"Decimal", kColoured},
    {u"Declare", kReserved | kColoured},
    {u"DefBool", kColoured},
    {u"DefByte", kColoured},
    {u"DefCur", kColoured},
    {u"DefDate", kColoured},
    {u"DefDbl", kColoured},
    {u"DefInt", kColoured},
    {u"DefLng", kColoured},
    {u"DefObj", kColoured},
    {u"DefSng", kColoured},
    {u"DefStr", kColoured},
    {u"DefVar", kColoured},
    {u"Dim", kReserved | kColoured},
    {u"Do", kReserved | kColoured},
    {u"Double", kReserved | kColoured},
    {u"Each", kReserved | kColoured},
    {u"Else", kReserved | kColoured},
    {u"ElseIf", kReserved | kColoured},
    {u"Empty", kReserved | kColoured},
    {u"End", kReserved | kColoured},
    {u"EndIf", kReserved},
    {u"Enum", kReserved | kColoured},
    {u"Eqv", kReserved | kColoured},
    {u"Erase", kReserved | kColoured},
    {u"Error", kColoured},
    {u"Event", kReserved | kColoured},
    {u"Exit", kReserved | kColoured},
    {u"Explicit", kColoured},
    {u"False", kReserved | kColoured},
    {u"For", kReserved | kColoured},
    {u"Friend", kReserved | kColoured},
    {u"Function", kReserved | kColoured},
    {u"Get", kReserved | kColoured},
    {u"Global", kReserved | kColoured},
    {u"GoSub", kReserved | kColoured},
    {u"GoTo", kReserved | kColoured},
    {u"If", kReserved | kColoured},
    {u"Imp", kReserved | kColoured},
    {u"Implements", kReserved | kColoured},
    {u"In", kReserved | kColoured},
    {u"Input", kColoured},
    {u"Integer", kReserved | kColoured},
    {u"Is", kReserved | kColoured},
    {u"Let", kReserved | kColoured},
    {u"Lib", kColoured},
    {u"Like", kReserved | kColoured},
    {u"Line", kColoured},
    {u"Lock", kReserved | kColoured},
    {u"Long", kReserved | kColoured},
    {u"Loop", kReserved | kColoured},
    {u"LSet", kReserved | kColoured},
    {u"Me", kReserved | kColoured},
    {u"Mod", kReserved | kColoured},
    {u"Module", kColoured},
    {u"New", kReserved | kColoured},
    {u"Next", kReserved | kColoured},
    {u"Not", kReserved | kColoured},
    {u"Nothing", kReserved | kColoured},
    {u"Null", kReserved | kColoured},
    {u"Object", kReserved | kColoured},
    {u"On", kReserved | kColoured},
    {u"Open", kReserved | kColoured},
    {u"Option", kReserved | kColoured},
    {u"Optional", kReserved | kColoured},
    {u"Or", kReserved | kColoured},
    {u"Output", kColoured},
    {u"ParamArray", kReserved | kColoured},
    {u"Preserve", kReserved | kColoured},
    {u"Print", kColoured},
    {u"Private", kReserved | kColoured},
    {u"Property", kReserved | kColoured},
    {u"Public", kReserved | kColoured},
    {u"Put", kReserved | kColoured},
    {u"RaiseEvent", kReserved | kColoured},
    {u"Random", kColoured},
    {u"Randomize", kReserved},
    {u"Read", kColoured},
    {u"ReDim", kReserved | kColoured},
    {u"Rem", kReserved},
    {u"Reset", kReserved},
    {u"Resume", kReserved | kColoured},
    {u"Return", kReserved | kColoured},
    {u"RSet", kReserved | kColoured},
    {u"Seek", kReserved | kColoured},
    {u"Select", kReserved | kColoured},
    {u"Set", kReserved | kColoured},
    {u"Shared", kColoured},
    {u"Single", kReserved | kColoured},
    {u"Spc", kColoured},
    {u"Static", kReserved | kColoured},
    {u"Step", kReserved | kColoured},
    {u"Stop", kReserved | kColoured},
    {u"String", kReserved | kColoured},
    {u"Sub", kReserved | kColoured},
    {u"Tab", kColoured},
    {u"Text", kColoured},
    {u"Then", kReserved | kColoured},
    {u"To", kReserved | kColoured},
    {u"True", kReserved | kColoured},
    {u"Type", kReserved | kColoured},
    {u"TypeOf", kReserved | kColoured},
    {u"Unlock", kReserved | kColoured},
    {u"Until", kReserved | kColoured},
    {u"Variant", kReserved | kColoured},
    {u"Wend", kReserved | kColoured},
    {u"While", kReserved | kColoured},
    {u"With", kReserved | kColoured},
    {u"WithEvents", kReserved | kColoured},
    {u"Write", kReserved | kColoured},
    {u"Xor", kReserved | kColoured},
};

/// Compares ASCII letters without regard to case; other characters by value, so a word holding one
/// never equals a keyword.
int compareFolded(QStringView a, QStringView b) noexcept {
  const qsizetype n = std::min(a.size(), b.size());
  for (qsizetype i = 0; i < n; ++i) {
    char16_t x = a[i].unicode();
    char16_t y = b[i].unicode();
    if (x >= u'A' && x <= u'Z') x |= 0x20;
    if (y >= u'A' && y <= u'Z') y |= 0x20;
    if (x != y) return x < y ? -1 : 1;
  }
  return a.size() == b.size() ? 0 : (a.size() < b.size() ? -1 : 1);
}

unsigned char flagsOf(QStringView word) noexcept {
  if (word.size() < 2 || word.size() > 10) return 0;
  const auto found =
      std::lower_bound(std::begin(kKeywords), std::end(kKeywords), word,
                       [](const Keyword& k, QStringView w) { return compareFolded(k.word, w) < 0; });
  return found != std::end(kKeywords) && compareFolded(found->word, word) == 0 ? found->flags : 0;
}

}  // namespace

bool isReservedWord(QStringView word) noexcept {
  return flagsOf(word) & kReserved;
}

bool isColouredKeyword(QStringView word) noexcept {
  return flagsOf(word) & kColoured;
}

}  // namespace syntax
