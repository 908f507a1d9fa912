// SPDX-License-Identifier: MIT
#include "lsp/protocol.h"

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

QByteArray frame(const QJsonObject& message) {
  const QByteArray body = QJsonDocument(message).toJson(QJsonDocument::Compact);
  return "Content-Length: " + QByteArray::number(body.size()) + "\r\n\r\n" + body;
}

QJsonObject response(const QJsonValue& id, const QJsonValue& result) {
  return {{QStringLiteral("jsonrpc"), QStringLiteral("2.0")},
          {QStringLiteral("id"), id},
          {QStringLiteral("result"), result}};
}

QJsonObject errorResponse(const QJsonValue& id, const Failure& failure) {
  return {{QStringLiteral("jsonrpc"), QStringLiteral("2.0")},
          {QStringLiteral("id"), id},
          {QStringLiteral("error"), QJsonObject{{QStringLiteral("code"), failure.code},
                                                {QStringLiteral("message"), failure.message}}}};
}

QJsonObject notification(const QString& method, const QJsonValue& params) {
  return {{QStringLiteral("jsonrpc"), QStringLiteral("2.0")},
          {QStringLiteral("method"), method},
          {QStringLiteral("params"), params}};
}

}  // namespace lsp
