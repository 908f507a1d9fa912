// SPDX-License-Identifier: MIT
#include "lsp/protocol.h"

#include <QJsonArray>
#include <QJsonDocument>

namespace lsp {

namespace {

// A body larger than this is refused rather than buffered: no editor sends one.
constexpr qint64 kLargestBody = qint64(1) << 30;

}  // namespace

std::optional<QByteArray> MessageReader::next(bool* framingError) {
  if (framingError) *framingError = false;
  while (true) {
    const qsizetype headerEnd = m_buffer.indexOf("\r\n\r\n");
    if (headerEnd < 0) return std::nullopt;
    qint64 length = -1;
    for (const QByteArray& line : m_buffer.left(headerEnd).split('\n')) {
      const qsizetype colon = line.indexOf(':');
      if (colon < 0 || line.left(colon).trimmed().compare("content-length", Qt::CaseInsensitive) != 0)
        continue;
      bool ok = false;
      length = line.mid(colon + 1).trimmed().toLongLong(&ok);
      if (!ok || length < 0 || length > kLargestBody) length = -1;
    }
    if (length < 0) {
      m_buffer.remove(0, headerEnd + 4);
      if (framingError) *framingError = true;
      return std::nullopt;
    }
    if (m_buffer.size() - (headerEnd + 4) < length) return std::nullopt;
    QByteArray body = m_buffer.mid(headerEnd + 4, length);
    m_buffer.remove(0, headerEnd + 4 + length);
    return body;
  }
}

QByteArray frame(QByteArrayView body) {
  QByteArray framed = "Content-Length: " + QByteArray::number(body.size()) + "\r\n\r\n";
  framed.reserve(framed.size() + body.size());
  framed.append(body);
  return framed;
}

namespace {

QByteArray compact(const QJsonObject& object) {
  return QJsonDocument(object).toJson(QJsonDocument::Compact);
}

}  // namespace

QByteArray response(const QJsonValue& id, const QJsonValue& result) {
  return compact({{QStringLiteral("jsonrpc"), QStringLiteral("2.0")},
                  {QStringLiteral("id"), id},
                  {QStringLiteral("result"), result}});
}

QByteArray response(const QJsonValue& id, QByteArrayView resultJson) {
  // The id as JSON: the one-element array's text without its brackets.
  const QByteArray idJson = QJsonDocument(QJsonArray{id}).toJson(QJsonDocument::Compact).chopped(1).sliced(1);
  QByteArray body = "{\"jsonrpc\":\"2.0\",\"id\":" + idJson + ",\"result\":";
  body.reserve(body.size() + resultJson.size() + 1);
  body.append(resultJson);
  body.append('}');
  return body;
}

QByteArray errorResponse(const QJsonValue& id, const Failure& failure) {
  return compact({{QStringLiteral("jsonrpc"), QStringLiteral("2.0")},
                  {QStringLiteral("id"), id},
                  {QStringLiteral("error"), QJsonObject{{QStringLiteral("code"), failure.code},
                                                        {QStringLiteral("message"), failure.message}}}});
}

QByteArray notification(const QString& method, const QJsonObject& params) {
  return compact({{QStringLiteral("jsonrpc"), QStringLiteral("2.0")},
                  {QStringLiteral("method"), method},
                  {QStringLiteral("params"), params}});
}

void appendJsonString(QByteArray& out, QStringView text) {
  out += '"';
  for (qsizetype i = 0; i < text.size(); ++i) {
    const char16_t u = text[i].unicode();
    if (u == u'"' || u == u'\\') {
      out += '\\';
      out += char(u);
    } else if (u < 0x20) {
      out += "\\u00";
      out += "0123456789abcdef"[u >> 4];
      out += "0123456789abcdef"[u & 15];
    } else if (u < 0x80) {
      out += char(u);
    } else {
      // A run of other characters at once, so that surrogate pairs stay together.
      qsizetype end = i + 1;
      while (end < text.size() && text[end].unicode() >= 0x80)
        ++end;
      out += text.sliced(i, end - i).toUtf8();
      i = end - 1;
    }
  }
  out += '"';
}

}  // namespace lsp
