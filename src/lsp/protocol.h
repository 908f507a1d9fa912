// SPDX-License-Identifier: MIT
// The wire of the language server: messages framed by a Content-Length header on a byte stream, and the
// JSON-RPC replies and error codes the protocol defines.
#pragma once

#include <QByteArray>
#include <QByteArrayView>
#include <QJsonObject>
#include <QJsonValue>
#include <QString>

#include <optional>

namespace lsp {

/// The JSON-RPC and protocol error codes the server answers with.
enum ErrorCode : int {
  kParseError = -32700,
  kInvalidRequest = -32600,
  kMethodNotFound = -32601,
  kInvalidParams = -32602,
  kInternalError = -32603,
  kServerNotInitialized = -32002,
  kRequestFailed = -32803,
};

/// A request that failed: its code and a message for the user.
struct Failure {
  int code = kRequestFailed;
  QString message;
};

/// Cuts a byte stream into the messages its headers frame. Bytes are fed as they arrive; each complete
/// message body comes out once. A header block without a usable Content-Length is dropped (as a framing
/// error) so that the stream can go on with the next message.
class MessageReader {
 public:
  void feed(QByteArrayView bytes) { m_buffer.append(bytes); }
  /// The next body, or nothing until more bytes arrive. `framingError` is set when a header was dropped.
  std::optional<QByteArray> next(bool* framingError = nullptr);

 private:
  QByteArray m_buffer;
};

/// The frame of one outgoing message body.
QByteArray frame(QByteArrayView body);

/// Message bodies (compact JSON). A result may come as JSON text already written (a long list of edits is
/// written straight into text, not built as objects first).
QByteArray response(const QJsonValue& id, const QJsonValue& result);
QByteArray response(const QJsonValue& id, QByteArrayView resultJson);
QByteArray errorResponse(const QJsonValue& id, const Failure& failure);
QByteArray notification(const QString& method, const QJsonObject& params);

/// `text` as a JSON string literal, quotes included (UTF-8).
void appendJsonString(QByteArray& out, QStringView text);

}  // namespace lsp
