// SPDX-License-Identifier: MIT
#include "projinfo/records.h"

#include "ide/error.h"

#include <limits>

namespace projinfo {
namespace {

constexpr long kTypeMismatch = 13;
constexpr long kOverflow = 6;

QString escaped(const QString& value) {
  QString out;
  out.reserve(value.size());
  for (const QChar c : value) {
    if (c == u'%')
      out += QLatin1StringView("%25");
    else if (c == u'[')
      out += QLatin1StringView("%5B");
    else if (c == u')')
      out += QLatin1StringView("%29");
    else
      out += c;
  }
  return out;
}

QString unescaped(QStringView value) {
  QString out;
  out.reserve(value.size());
  for (qsizetype i = 0; i < value.size(); ++i) {
    if (value[i] == u'%' && i + 2 < value.size()) {
      const QStringView code = value.sliced(i + 1, 2);
      const QChar c = code.compare(u"25", Qt::CaseInsensitive) == 0   ? QChar(u'%')
                      : code.compare(u"5B", Qt::CaseInsensitive) == 0 ? QChar(u'[')
                      : code.compare(u"29", Qt::CaseInsensitive) == 0 ? QChar(u')')
                                                                      : QChar();
      if (!c.isNull()) {
        out += c;
        i += 2;
        continue;
      }
    }
    out += value[i];
  }
  return out;
}

}  // namespace

QString writeRecord(const RecordFields& fields) {
  QString text = QLatin1StringView(kEscapedMarker);
  for (const auto& [key, value] : fields)
    text += QLatin1StringView(key) + escaped(value) + u')';
  return text;
}

RecordText::RecordText(QString text)
    : m_text(std::move(text)), m_escaped(m_text.startsWith(QLatin1StringView(kEscapedMarker))) {}

std::optional<QString> RecordText::value(const char* key) const {
  const QLatin1StringView k(key);
  const qsizetype at = m_text.indexOf(k);
  if (at < 0) return std::nullopt;
  const qsizetype start = at + k.size();
  qsizetype end = m_text.indexOf(u')', start);
  // A value that runs to the end of the text without its parenthesis is taken as it is.
  if (end < 0) end = m_text.size();
  const QStringView raw = QStringView(m_text).sliced(start, end - start);
  return m_escaped ? unescaped(raw) : raw.toString();
}

QString RecordText::text(const char* key) const {
  auto found = value(key);
  if (!found)
    throw ide::Error(kTypeMismatch, QStringLiteral("the record has no field %1").arg(QLatin1StringView(key)));
  return *found;
}

qint32 RecordText::number(const char* key) const {
  const QString raw = text(key).trimmed();
  bool ok = false;
  const qlonglong value = raw.toLongLong(&ok);
  if (!ok)
    throw ide::Error(kTypeMismatch,
                     QStringLiteral("%1 is not a number: \"%2\"").arg(QLatin1StringView(key), raw));
  if (value < std::numeric_limits<qint32>::min() || value > std::numeric_limits<qint32>::max())
    throw ide::Error(kOverflow, QStringLiteral("%1 is too large: %2").arg(QLatin1StringView(key), raw));
  return static_cast<qint32>(value);
}

bool RecordText::boolean(const char* key) const {
  const QString raw = text(key).trimmed();
  if (raw.compare(QLatin1StringView("True"), Qt::CaseInsensitive) == 0) return true;
  if (raw.compare(QLatin1StringView("False"), Qt::CaseInsensitive) == 0) return false;
  return number(key) != 0;
}

QString TaskRecord::toText() const {
  return writeRecord({{"[Name](", Name},
                      {"[Text](", Text},
                      {"[Done](", Done ? QStringLiteral("-1") : QStringLiteral("0")},
                      {"[ItemId](", QString::number(ItemId)}});
}

TaskRecord TaskRecord::fromText(const QString& text) {
  const RecordText record(text);
  return {record.text("[Name]("), record.text("[Text]("), record.boolean("[Done]("),
          record.number("[ItemId](")};
}

QString FavoriteRecord::toText() const {
  return writeRecord({{"[ComponentName](", ComponentName},
                      {"[ProcedureName](", ProcedureName},
                      {"[ProcKind](", QString::number(ProcKind)},
                      {"[ItemId](", QString::number(ItemId)},
                      {"[Line](", QString::number(Line)}});
}

FavoriteRecord FavoriteRecord::fromText(const QString& text) {
  const RecordText record(text);
  return {record.text("[ComponentName]("), record.text("[ProcedureName]("), record.number("[ProcKind]("),
          record.number("[ItemId]("), record.number("[Line](")};
}

}  // namespace projinfo
