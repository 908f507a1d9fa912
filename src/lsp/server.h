// SPDX-License-Identifier: MIT
// The language server: one object that takes the client's messages one by one and answers through a
// sink, so that it runs the same over standard input and output and inside tests. It reads files but
// never writes one: every change goes back to the editor as edits.
#pragma once

#include "lsp/documents.h"
#include "lsp/outline.h"
#include "lsp/projects.h"
#include "lsp/protocol.h"
#include "lsp/rewrite.h"

#include <QDateTime>
#include <QHash>
#include <QJsonObject>
#include <QSet>

#include <functional>
#include <memory>
#include <unordered_map>

namespace lsp {

class Server {
 public:
  /// Receives each outgoing message body (compact JSON), to be framed.
  using Sink = std::function<void(const QByteArray&)>;
  /// `version` is what initialize reports.
  Server(Sink sink, QString version);
  ~Server();

  /// One message body as it came off the wire (a request, a notification or bad JSON).
  void handle(QByteArrayView body);
  /// A header block that framed no message: answered as unreadable JSON.
  void framingError();
  /// No message is waiting: work left for later is done now (taking apart the last rewritten module).
  void idle();

  /// The client sent exit: the process ends with exitCode() (0 after shutdown, 1 otherwise).
  bool exited() const { return m_exited; }
  int exitCode() const { return m_shutdown ? 0 : 1; }

 private:
  /// A result already written as JSON text.
  struct JsonText {
    QByteArray text;
  };
  using Result = std::variant<QJsonValue, Failure, JsonText>;

  void request(const QJsonValue& id, const QString& method, const QJsonObject& params);
  void notify(const QString& method, const QJsonObject& params);
  Result dispatch(const QString& method, const QJsonObject& params);

  Result initialize(const QJsonObject& params);
  Result formatting(const QJsonObject& params, bool range);
  Result codeActions(const QJsonObject& params);
  Result resolveCodeAction(QJsonObject action);
  Result documentSymbols(const QJsonObject& params);
  Result foldingRanges(const QJsonObject& params);
  Result workspaceSymbols(const QJsonObject& params);
  Result references(const QJsonObject& params);

  void didOpen(const QJsonObject& params);
  void didChange(const QJsonObject& params);
  void didClose(const QJsonObject& params);
  void publishDiagnostics(Document& document);
  void publishProjectDiagnostics(const QString& listingPath);

  /// The open document a request names, or why not.
  std::variant<Document*, Failure> documentOf(const QJsonObject& params);
  Document* openDocument(const QString& path);
  /// The outline of an open document (kept until its text changes), or why it cannot be read.
  struct Reading {
    int version = -1;
    std::vector<QStringView> lines;
    std::variant<CodeLayout, Failure> layout = Failure{};
    Outline outline;
  };
  const Reading& readingOf(Document& document);
  /// The project listing the module, cached by module.
  QString projectFor(const QString& modulePath);
  /// The module files the document's group (or project, or the document alone) holds.
  QStringList modulesAround(const Document& document);

  Sink m_sink;
  QString m_version;
  ModuleRewriter m_rewriter;
  bool m_initialized = false;
  bool m_shutdown = false;
  bool m_exited = false;
  bool m_resolveEdits = false;
  std::unordered_map<QString, std::unique_ptr<Document>> m_documents;  // by URI
  std::unordered_map<QString, Reading> m_readings;                     // by URI
  QHash<QString, QString> m_projects;                                  // module path -> project file
  struct Indexed {
    QDateTime modified;
    qint64 size = 0;
    std::vector<Symbol> symbols;
  };
  QHash<QString, Indexed> m_index;  // module files read from disk for the workspace's symbols
};

/// Serves the client on two file descriptors (standard input and output) until it sends exit or closes
/// its end; returns the exit code.
int serve(int input, int output, const QString& version);

}  // namespace lsp
