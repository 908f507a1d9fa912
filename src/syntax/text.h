// SPDX-License-Identifier: MIT
// The characters of VB source text and small views over one line: blanks, identifier characters, trimming
// and the number test behind line numbers. Everything works on views, so a line that is only inspected is
// never copied. The same tests exist for Windows-1252 bytes, so that tools reading files as bytes see the
// characters exactly as the decoded text shows them.
#pragma once

#include <QChar>
#include <QStringView>

#include <array>

namespace syntax {

/// Blanks are spaces and tabs: programmers indent with both, and the language separates words with both.
/// Other white space (line ends, form feeds) never occurs inside a line.
constexpr bool isBlank(char16_t c) noexcept {
  return c == u' ' || c == u'\t';
}
constexpr bool isBlank(QChar c) noexcept {
  return isBlank(c.unicode());
}
constexpr bool isBlank(char c) noexcept {
  return c == ' ' || c == '\t';
}

/// Characters that make up identifiers: letters of any script (the letters of the ANSI code page among
/// them), digits and the underscore.
inline bool isIdentifierChar(char16_t c) noexcept {
  if (c < 0x80) return unsigned((c | 0x20) - u'a') < 26u || unsigned(c - u'0') < 10u || c == u'_';
  return QChar(c).isLetterOrNumber();
}
inline bool isIdentifierChar(QChar c) noexcept {
  return isIdentifierChar(c.unicode());
}
/// The same for a Windows-1252 byte: true exactly when the character it decodes to is one.
bool isIdentifierChar(char byte) noexcept;

/// A character that may begin an identifier (and so a label): a letter.
inline bool isIdentifierStart(char16_t c) noexcept {
  if (c < 0x80) return unsigned((c | 0x20) - u'a') < 26u;
  return QChar(c).isLetter();
}
bool isIdentifierStart(char byte) noexcept;

constexpr bool isDigit(char16_t c) noexcept {
  return c >= u'0' && c <= u'9';
}

/// The leading blanks of `line`, exactly as written.
inline QStringView leadingBlanks(QStringView line) noexcept {
  qsizetype i = 0;
  while (i < line.size() && isBlank(line[i]))
    ++i;
  return line.first(i);
}

/// `line` without leading and trailing blanks.
inline QStringView trimmedView(QStringView line) noexcept {
  qsizetype begin = 0;
  qsizetype end = line.size();
  while (begin < end && isBlank(line[begin]))
    ++begin;
  while (end > begin && isBlank(line[end - 1]))
    --end;
  return line.sliced(begin, end - begin);
}

/// `line` without trailing blanks.
inline QStringView rightTrimmedView(QStringView line) noexcept {
  qsizetype end = line.size();
  while (end > 0 && isBlank(line[end - 1]))
    --end;
  return line.first(end);
}

/// True when `line` holds nothing but blanks.
inline bool isBlankLine(QStringView line) noexcept {
  return trimmedView(line).isEmpty();
}

/// The first position at or after `from` that is not a blank (the text's size when there is none).
inline qsizetype skipBlanks(QStringView text, qsizetype from) noexcept {
  while (from < text.size() && isBlank(text[from]))
    ++from;
  return from;
}

/// Position of the first blank in `text`, or -1.
inline qsizetype indexOfBlank(QStringView text) noexcept {
  for (qsizetype i = 0; i < text.size(); ++i) {
    if (isBlank(text[i])) return i;
  }
  return -1;
}

/// `word` is `keyword` in any letter case. Keywords are ASCII letters, so setting the case bit cannot
/// make another character equal to one.
constexpr bool isKeyword(QStringView word, QStringView keyword) noexcept {
  if (word.size() != keyword.size()) return false;
  for (qsizetype i = 0; i < word.size(); ++i)
    if ((word[i].unicode() | 0x20) != (keyword[i].unicode() | 0x20)) return false;
  return true;
}

/// A plain decimal number, blanks around it ignored: an optional sign directly followed by digits with at
/// most one decimal point and at least one digit ("10", " -5 ", "+1.5", ".5", "10."). Exponents, hexadecimal
/// and octal forms, thousands separators, currency signs and parentheses are not numbers: the rules only need
/// to recognise the line numbers and numeric labels that programmers and the numbering tool write (the tool
/// writes a negative number when it is started below zero).
bool isNumeric(QStringView text) noexcept;

/// False when `text` cannot begin a number (its first character is no digit, sign or point).
constexpr bool mayBeginNumber(QStringView text) noexcept {
  if (text.isEmpty()) return false;
  const char16_t c = text.front().unicode();
  return isDigit(c) || c == u'+' || c == u'-' || c == u'.';
}

/// A number the rules may take for a line number: numeric, and its last character is neither "." nor ","
/// (so "10." is an unfinished expression, not a number).
inline bool isUsableNumber(QStringView text) noexcept {
  return !text.isEmpty() && text.back() != u'.' && text.back() != u',' && isNumeric(text);
}

}  // namespace syntax
