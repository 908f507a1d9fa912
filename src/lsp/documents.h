// SPDX-License-Identifier: MIT
// The documents the editor has open: their text as the editor holds it (UTF-16, as the protocol counts
// positions), the edits it sends, and the file each one stands for.
#pragma once

#include <QJsonObject>
#include <QString>
#include <QStringView>

#include <optional>
#include <vector>

namespace lsp {

/// A place in a document: a line (0-based) and a column in UTF-16 code units.
struct Position {
  int line = 0;
  int character = 0;
};

struct Range {
  Position start;
  Position end;
};

QJsonObject toJson(const Position& position);
QJsonObject toJson(const Range& range);
std::optional<Position> positionFrom(const QJsonValue& value);
std::optional<Range> rangeFrom(const QJsonValue& value);

/// The local path of a file: URI; nothing for any other scheme.
std::optional<QString> pathOfUri(const QString& uri);
QString uriOfPath(const QString& path);

/// A text cut into lines as the protocol cuts it: at CR LF, LF or a lone CR.
class LineIndex {
 public:
  explicit LineIndex(QStringView text);
  int count() const { return int(m_starts.size()); }
  /// The line without its line end.
  QStringView line(QStringView text, int line) const;
  /// The offset of a position, clamped to the line's text (the protocol asks that of a column past it).
  qsizetype offset(QStringView text, const Position& position) const;

 private:
  std::vector<qsizetype> m_starts;  // where each line begins
  std::vector<qsizetype> m_ends;    // where its text ends (before the line end)
};

class Document {
 public:
  Document(QString uri, QString path, QString text, int version);
  const QString& uri() const { return m_uri; }
  const QString& path() const { return m_path; }
  const QString& text() const { return m_text; }
  int version() const { return m_version; }
  const LineIndex& lines() const { return m_lines; }
  QStringView line(int line) const { return m_lines.line(m_text, line); }

  /// Applies one entry of didChange's contentChanges: a range and its new text, or (no range) the whole
  /// text. False when the entry is malformed.
  bool applyChange(const QJsonObject& change);
  void setVersion(int version) { m_version = version; }

 private:
  QString m_uri;
  QString m_path;
  QString m_text;
  int m_version;
  LineIndex m_lines;
};

}  // namespace lsp
