// SPDX-License-Identifier: MIT
#include "lsp/documents.h"

#include <QDir>
#include <QJsonValue>
#include <QUrl>

#include <algorithm>

namespace lsp {

QJsonObject toJson(const Position& position) {
  return {{QStringLiteral("line"), position.line}, {QStringLiteral("character"), position.character}};
}

QJsonObject toJson(const Range& range) {
  return {{QStringLiteral("start"), toJson(range.start)}, {QStringLiteral("end"), toJson(range.end)}};
}

std::optional<Position> positionFrom(const QJsonValue& value) {
  const QJsonObject object = value.toObject();
  const QJsonValue line = object.value(QLatin1StringView("line"));
  const QJsonValue character = object.value(QLatin1StringView("character"));
  if (!line.isDouble() || !character.isDouble() || line.toDouble() < 0 || character.toDouble() < 0)
    return std::nullopt;
  return Position{line.toInt(), character.toInt()};
}

std::optional<Range> rangeFrom(const QJsonValue& value) {
  const auto start = positionFrom(value.toObject().value(QLatin1StringView("start")));
  const auto end = positionFrom(value.toObject().value(QLatin1StringView("end")));
  if (!start || !end) return std::nullopt;
  return Range{*start, *end};
}

std::optional<QString> pathOfUri(const QString& uri) {
  const QUrl url(uri, QUrl::StrictMode);
  if (!url.isValid() || !url.isLocalFile()) return std::nullopt;
  return QDir::cleanPath(url.toLocalFile());
}

QString uriOfPath(const QString& path) {
  return QString::fromUtf8(QUrl::fromLocalFile(path).toEncoded());
}

LineIndex::LineIndex(QStringView text) {
  qsizetype start = 0;
  for (qsizetype i = 0; i < text.size(); ++i) {
    const QChar c = text[i];
    if (c != u'\n' && c != u'\r') continue;
    m_starts.push_back(start);
    m_ends.push_back(i);
    if (c == u'\r' && i + 1 < text.size() && text[i + 1] == u'\n') ++i;
    start = i + 1;
  }
  m_starts.push_back(start);
  m_ends.push_back(text.size());
}

QStringView LineIndex::line(QStringView text, int line) const {
  if (line < 0 || line >= count()) return {};
  return text.mid(m_starts[size_t(line)], m_ends[size_t(line)] - m_starts[size_t(line)]);
}

qsizetype LineIndex::offset(QStringView text, const Position& position) const {
  if (position.line >= count()) return text.size();
  const size_t line = size_t(position.line);
  return std::min(m_starts[line] + position.character, m_ends[line]);
}

Document::Document(QString uri, QString path, QString text, int version)
    : m_uri(std::move(uri)),
      m_path(std::move(path)),
      m_text(std::move(text)),
      m_version(version),
      m_lines(m_text) {}

bool Document::applyChange(const QJsonObject& change) {
  const QJsonValue text = change.value(QLatin1StringView("text"));
  if (!text.isString()) return false;
  if (!change.contains(QLatin1StringView("range"))) {
    m_text = text.toString();
  } else {
    const auto range = rangeFrom(change.value(QLatin1StringView("range")));
    if (!range) return false;
    const qsizetype from = m_lines.offset(m_text, range->start);
    const qsizetype to = std::max(from, m_lines.offset(m_text, range->end));
    m_text.replace(from, to - from, text.toString());
  }
  m_lines = LineIndex(m_text);
  return true;
}

}  // namespace lsp
