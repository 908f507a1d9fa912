// SPDX-License-Identifier: MIT
// Readable GoogleTest output for Qt values: GoogleTest finds PrintTo next to QString, tabs show as "\t" so
// that a tab cannot pass for a space, and a list shows a line per element.
#pragma once

#include <QString>
#include <QStringList>
#include <QVariant>

#include <ostream>

QT_BEGIN_NAMESPACE
inline void PrintTo(const QString& text, std::ostream* out) {
  *out << '"' << QString(text).replace(u'\t', u"\\t"_qs).toStdString() << '"';
}
inline void PrintTo(const QStringList& lines, std::ostream* out) {
  *out << '\n';
  for (const QString& line : lines) {
    *out << "  ";
    PrintTo(line, out);
    *out << '\n';
  }
}
inline void PrintTo(const QVariant& value, std::ostream* out) {
  *out << value.typeName() << '(' << value.toString().toStdString() << ')';
}
QT_END_NAMESPACE
