// SPDX-License-Identifier: MIT
// Small views over one line of code shared by the numbering and indentation rules: blanks, trimming,
// statement continuation and the "usable number" test. Everything works on views, so a line that is only
// inspected is never copied.
#pragma once

#include <QStringView>

namespace transform {

/// Blanks are spaces and tabs: programmers indent with both, so every trim and every leading-blank count
/// treats them alike. Other white space (line ends, form feeds) never occurs inside a line of the IDE.
constexpr bool isBlank(QChar c) noexcept {
  return c == u' ' || c == u'\t';
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

/// Position of the first blank in `text`, or -1.
inline qsizetype indexOfBlank(QStringView text) noexcept {
  for (qsizetype i = 0; i < text.size(); ++i) {
    if (isBlank(text[i])) return i;
  }
  return -1;
}

/// True when the statement on `trimmed` (a line already trimmed) goes on on the next line: it ends with a
/// space and an underscore.
inline bool endsWithContinuation(QStringView trimmed) noexcept {
  return trimmed.endsWith(u" _");
}

/// True when the line, after trimming, ends with the continuation mark. Walkers use it on procedure
/// headers.
inline bool isContinued(QStringView line) noexcept {
  return endsWithContinuation(trimmedView(line));
}

/// True when the trimmed line is a procedure's End line (End Sub, End Function, End Property), which
/// no rule numbers or indents and where every procedure walk stops.
inline bool isProcedureEnd(QStringView trimmed) noexcept {
  if (trimmed.size() < 7 || trimmed.front() != u'E') return false;  // most lines, without a call
  return trimmed.startsWith(u"End Sub") || trimmed.startsWith(u"End Function") ||
         trimmed.startsWith(u"End Property");
}

/// A plain decimal number, blanks around it ignored: an optional sign directly followed by digits with at
/// most one decimal point and at least one digit ("10", " -5 ", "+1.5", ".5", "10."). Exponents, hexadecimal
/// and octal forms, thousands separators, currency signs and parentheses are not numbers: the rules only need
/// to recognise the line numbers and numeric labels that programmers and this tool write.
bool isNumeric(QStringView text) noexcept;

/// False when `text` cannot begin a number (its first character is no digit, sign or point): the rules
/// look for a number prefix only on lines that pass, which spares the search for ":" and "'" on the rest.
constexpr bool mayBeginNumber(QStringView text) noexcept {
  if (text.isEmpty()) return false;
  const QChar c = text.front();
  return (c >= u'0' && c <= u'9') || c == u'+' || c == u'-' || c == u'.';
}

/// A number the rules may take for a line number: numeric, and its last character is neither "." nor ","
/// (so "10." is an unfinished expression, not a number).
inline bool isUsableNumber(QStringView text) noexcept {
  return !text.isEmpty() && text.back() != u'.' && text.back() != u',' && isNumeric(text);
}

}  // namespace transform
