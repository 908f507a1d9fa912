// SPDX-License-Identifier: MIT
// Readable failure messages for texts: GoogleTest finds PrintTo next to QString, and tabs show as "\t" so
// that a tab cannot pass for a space in a diff.
#pragma once

#include <QString>
#include <QStringList>

#include <ostream>

QT_BEGIN_NAMESPACE

inline void PrintTo(const QString& text, std::ostream* os) {
  QString shown = text;
  shown.replace(u'\t', u"\\t"_qs);
  *os << '"' << shown.toStdString() << '"';
}

inline void PrintTo(const QStringList& lines, std::ostream* os) {
  *os << '\n';
  for (const QString& line : lines) {
    *os << "  ";
    PrintTo(line, os);
    *os << '\n';
  }
}

QT_END_NAMESPACE
