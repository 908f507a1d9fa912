// SPDX-License-Identifier: MIT
#include "lsp/server.h"

#include "codestyle/codestyle.h"
#include "common/settings.h"
#include "fileio/parallel.h"
#include "find/findwalk.h"
#include "host/model/vbe.h"
#include "ide/error.h"
#include "lsp/rewrite.h"

#include <QFileInfo>
#include <QJsonArray>
#include <QJsonDocument>

#include <algorithm>
#include <cerrno>
#include <charconv>
#include <cstring>
#include <string_view>

#include <unistd.h>

namespace lsp {

namespace {

constexpr int kLongestLine = 1023;
// The workspace's symbols answer with at most this many, module by module in the projects' order.
constexpr qsizetype kMostSymbols = 10000;

Failure invalidParams(const QString& message) {
  return Failure{kInvalidParams, message};
}

QString kindPrefix() {
  return QStringLiteral("source.quimbel.");
}

struct ActionKind {
  const char* id;
  const char* title;
  Rewrite rewrite;
};
// The three commands on the code, as the command line has them.
const ActionKind kActions[] = {
    {"number", "Number lines", Rewrite::Number},
    {"unnumber", "Remove line numbers", Rewrite::Unnumber},
    {"numindent", "Number and indent", Rewrite::NumIndent},
};

/// The style in force for a module file, the editor's choice standing in where nothing else says.
std::variant<codestyle::Style, Failure> styleFor(const QString& path, const QJsonObject& editorOptions = {}) {
  const common::SettingsStore settings(common::SettingsStore::userStorePath());
  const codestyle::Resolver resolver({}, &settings);
  auto resolved = resolver.styleFor(path);
  if (const auto* error = std::get_if<codestyle::StyleError>(&resolved))
    return Failure{
        kRequestFailed,
        error->line > 0
            ? QStringLiteral("%1, line %2: %3").arg(error->file).arg(error->line).arg(error->message)
            : QStringLiteral("%1: %2").arg(error->file, error->message)};
  codestyle::Style style = std::get<codestyle::Style>(resolved);
  const QJsonValue insertSpaces = editorOptions.value(QLatin1StringView("insertSpaces"));
  const QJsonValue tabSize = editorOptions.value(QLatin1StringView("tabSize"));
  if (style.indentStyle.source == codestyle::Source::Default && insertSpaces.isBool())
    style.indentStyle.value =
        insertSpaces.toBool() ? transform::IndentMode::Spaces : transform::IndentMode::Tabs;
  if (style.indentSize.source == codestyle::Source::Default && tabSize.isDouble() && tabSize.toInt() >= 1 &&
      tabSize.toInt() <= codestyle::kMostSpaces)
    style.indentSize.value = tabSize.toInt();
  return style;
}

/// Edits as JSON text, written straight into one buffer: a format of a large module answers with an edit
/// per line, and building objects for them would take longer than the format itself.
QByteArray editsJson(const std::vector<TextEdit>& edits) {
  QByteArray out(qsizetype(edits.size()) * 96 + 2, Qt::Uninitialized);
  qsizetype used = 0;
  const auto reserve = [&](qsizetype more) {
    if (used + more > out.size()) out.resize(std::max(out.size() * 2, used + more));
  };
  const auto text = [&](std::string_view part) {
    std::memcpy(out.data() + used, part.data(), part.size());
    used += qsizetype(part.size());
  };
  const auto number = [&](int value) {
    used = std::to_chars(out.data() + used, out.data() + out.size(), value).ptr - out.data();
  };
  out[used++] = '[';
  for (const TextEdit& edit : edits) {
    // The numbers and keys take at most 100 bytes; a character at most 6 in JSON.
    reserve(100 + edit.newText.size() * 6);
    if (used > 1) out[used++] = ',';
    text("{\"range\":{\"start\":{\"line\":");
    number(edit.range.start.line);
    text(",\"character\":");
    number(edit.range.start.character);
    text("},\"end\":{\"line\":");
    number(edit.range.end.line);
    text(",\"character\":");
    number(edit.range.end.character);
    text("}},\"newText\":");
    // Blanks and digits, nearly always; anything else is written by the general writer.
    bool plain = true;
    for (const QChar c : edit.newText)
      plain = plain && (c == u'\t' || (c.unicode() >= 0x20 && c.unicode() < 0x7f && c != u'"' && c != u'\\'));
    if (plain) {
      out[used++] = '"';
      for (const QChar c : edit.newText) {
        if (c == u'\t') {
          out[used++] = '\\';
          out[used++] = 't';
        } else {
          out[used++] = char(c.unicode());
        }
      }
      out[used++] = '"';
    } else {
      QByteArray literal;
      appendJsonString(literal, edit.newText);
      text(std::string_view(literal.constData(), size_t(literal.size())));
    }
    out[used++] = '}';
  }
  reserve(1);
  out[used++] = ']';
  out.truncate(used);
  return out;
}

QJsonObject symbolJson(const Symbol& symbol, const std::vector<QStringView>& lines) {
  const int endLength = symbol.endLine < int(lines.size()) ? int(lines[size_t(symbol.endLine)].size()) : 0;
  QJsonArray children;
  for (const Symbol& child : symbol.children)
    children.append(symbolJson(child, lines));
  QJsonObject object{{QStringLiteral("name"), symbol.name},
                     {QStringLiteral("detail"), symbol.detail},
                     {QStringLiteral("kind"), int(symbol.kind)},
                     {QStringLiteral("range"), toJson(Range{{symbol.line, 0}, {symbol.endLine, endLength}})},
                     {QStringLiteral("selectionRange"),
                      toJson(Range{{symbol.line, symbol.nameColumn},
                                   {symbol.line, symbol.nameColumn + symbol.nameLength}})}};
  if (!children.isEmpty()) object.insert(QStringLiteral("children"), children);
  return object;
}

bool isModuleFile(const QString& path) {
  static const QStringList kSuffixes = {QStringLiteral("bas"), QStringLiteral("cls"), QStringLiteral("frm"),
                                        QStringLiteral("ctl"), QStringLiteral("pag"), QStringLiteral("dob"),
                                        QStringLiteral("dsr")};
  return kSuffixes.contains(QFileInfo(path).suffix().toLower());
}

bool isListingFile(const QString& path) {
  const QString suffix = QFileInfo(path).suffix().toLower();
  return suffix == QLatin1StringView("vbp") || suffix == QLatin1StringView("vbg");
}

/// The identifier at or just before `column`.
QString identifierAt(QStringView line, int column) {
  const auto isWordChar = [](QChar c) { return c.isLetterOrNumber() || c == u'_'; };
  qsizetype from = std::min<qsizetype>(column, line.size());
  qsizetype to = from;
  while (from > 0 && isWordChar(line[from - 1]))
    --from;
  while (to < line.size() && isWordChar(line[to]))
    ++to;
  return line.mid(from, to - from).toString();
}

/// Collects the rows of a find.
class Rows final : public find::FindReport {
 public:
  void status(const QString&) override {}
  void resultsLabel(const QString&) override {}
  void found(find::FoundRow row) override { rows.push_back(std::move(row)); }
  std::vector<find::FoundRow> rows;
};

}  // namespace

Server::Server(Sink sink, QString version) : m_sink(std::move(sink)), m_version(std::move(version)) {}

Server::~Server() = default;

void Server::idle() {
  m_rewriter.release();
}

void Server::framingError() {
  m_sink(
      errorResponse(QJsonValue::Null, {kParseError, QStringLiteral("a message without a Content-Length")}));
}

void Server::handle(QByteArrayView body) {
  QJsonParseError error;
  const QJsonDocument document = QJsonDocument::fromJson(body.toByteArray(), &error);
  if (error.error != QJsonParseError::NoError) {
    m_sink(errorResponse(
        QJsonValue::Null,
        {kParseError,
         QStringLiteral("not JSON: %1 at offset %2").arg(error.errorString()).arg(error.offset)}));
    return;
  }
  const QJsonObject message = document.object();
  const QJsonValue method = message.value(QLatin1StringView("method"));
  const QJsonValue id = message.value(QLatin1StringView("id"));
  const bool hasId = message.contains(QLatin1StringView("id"));
  if (!document.isObject() || (!method.isString() && !hasId) ||
      (hasId && !id.isString() && !id.isDouble() && !id.isNull())) {
    m_sink(errorResponse(hasId && (id.isString() || id.isDouble()) ? id : QJsonValue::Null,
                         {kInvalidRequest, QStringLiteral("not a JSON-RPC request or notification")}));
    return;
  }
  if (!method.isString()) return;  // a response: the server sends no requests
  const QJsonValue params = message.value(QLatin1StringView("params"));
  if (hasId)
    request(id, method.toString(), params.toObject());
  else
    notify(method.toString(), params.toObject());
}

void Server::request(const QJsonValue& id, const QString& method, const QJsonObject& params) {
  Result result;
  if (!m_initialized && method != QLatin1StringView("initialize")) {
    result = Failure{kServerNotInitialized, QStringLiteral("the server has not been initialized")};
  } else if (m_initialized && method == QLatin1StringView("initialize")) {
    result = Failure{kInvalidRequest, QStringLiteral("the server is initialized already")};
  } else if (m_shutdown) {
    result = Failure{kInvalidRequest, QStringLiteral("the server is shutting down")};
  } else {
    try {
      result = dispatch(method, params);
    } catch (const ide::Error& error) {
      // A file the core cannot read or use: the request fails, the server goes on.
      result = Failure{kRequestFailed, error.description()};
    } catch (const std::exception& failure) {
      result = Failure{kInternalError, QString::fromLocal8Bit(failure.what())};
    }
  }
  if (const auto* failure = std::get_if<Failure>(&result))
    m_sink(errorResponse(id, *failure));
  else if (const auto* text = std::get_if<JsonText>(&result))
    m_sink(response(id, text->text));
  else
    m_sink(response(id, std::get<QJsonValue>(result)));
}

Server::Result Server::dispatch(const QString& method, const QJsonObject& params) {
  if (method == QLatin1StringView("initialize")) return initialize(params);
  if (method == QLatin1StringView("shutdown")) {
    m_shutdown = true;
    return QJsonValue(QJsonValue::Null);
  }
  if (method == QLatin1StringView("textDocument/formatting")) return formatting(params, false);
  if (method == QLatin1StringView("textDocument/rangeFormatting")) return formatting(params, true);
  if (method == QLatin1StringView("textDocument/codeAction")) return codeActions(params);
  if (method == QLatin1StringView("codeAction/resolve")) return resolveCodeAction(params);
  if (method == QLatin1StringView("textDocument/documentSymbol")) return documentSymbols(params);
  if (method == QLatin1StringView("textDocument/foldingRange")) return foldingRanges(params);
  if (method == QLatin1StringView("workspace/symbol")) return workspaceSymbols(params);
  if (method == QLatin1StringView("textDocument/references")) return references(params);
  return Failure{kMethodNotFound, QStringLiteral("no method %1").arg(method)};
}

void Server::notify(const QString& method, const QJsonObject& params) {
  if (method == QLatin1StringView("exit")) {
    m_exited = true;
    return;
  }
  // Before initialize, notifications are dropped, as the protocol asks.
  if (!m_initialized || m_shutdown) return;
  try {
    if (method == QLatin1StringView("textDocument/didOpen"))
      didOpen(params);
    else if (method == QLatin1StringView("textDocument/didChange"))
      didChange(params);
    else if (method == QLatin1StringView("textDocument/didClose"))
      didClose(params);
  } catch (const std::exception&) {
    // A notification has no answer; a document that cannot be read simply gets no diagnostics.
  }
}

Server::Result Server::initialize(const QJsonObject& params) {
  const QJsonArray resolvable = params.value(QLatin1StringView("capabilities"))
                                    .toObject()
                                    .value(QLatin1StringView("textDocument"))
                                    .toObject()
                                    .value(QLatin1StringView("codeAction"))
                                    .toObject()
                                    .value(QLatin1StringView("resolveSupport"))
                                    .toObject()
                                    .value(QLatin1StringView("properties"))
                                    .toArray();
  m_resolveEdits = resolvable.contains(QStringLiteral("edit"));
  m_initialized = true;
  QJsonArray kinds;
  for (const ActionKind& action : kActions)
    kinds.append(kindPrefix() + QLatin1StringView(action.id));
  const QJsonObject capabilities{
      {QStringLiteral("positionEncoding"), QStringLiteral("utf-16")},
      {QStringLiteral("textDocumentSync"),
       QJsonObject{{QStringLiteral("openClose"), true}, {QStringLiteral("change"), 2}}},
      {QStringLiteral("documentFormattingProvider"), true},
      {QStringLiteral("documentRangeFormattingProvider"), true},
      {QStringLiteral("codeActionProvider"),
       QJsonObject{{QStringLiteral("codeActionKinds"), kinds}, {QStringLiteral("resolveProvider"), true}}},
      {QStringLiteral("documentSymbolProvider"), true},
      {QStringLiteral("foldingRangeProvider"), true},
      {QStringLiteral("workspaceSymbolProvider"), true},
      {QStringLiteral("referencesProvider"), true},
  };
  return QJsonObject{
      {QStringLiteral("capabilities"), capabilities},
      {QStringLiteral("serverInfo"), QJsonObject{{QStringLiteral("name"), QStringLiteral("quimbel")},
                                                 {QStringLiteral("version"), m_version}}}};
}

std::variant<Document*, Failure> Server::documentOf(const QJsonObject& params) {
  const QString uri =
      params.value(QLatin1StringView("textDocument")).toObject().value(QLatin1StringView("uri")).toString();
  const auto found = m_documents.find(uri);
  if (found == m_documents.end())
    return invalidParams(uri.isEmpty() ? QStringLiteral("no textDocument.uri")
                                       : QStringLiteral("%1 is not open").arg(uri));
  if (found->second->path().isEmpty())
    return Failure{kRequestFailed, QStringLiteral("%1 is no local file").arg(uri)};
  return found->second.get();
}

Document* Server::openDocument(const QString& path) {
  for (auto& [uri, document] : m_documents)
    if (!document->path().isEmpty() && (document->path() == path || sameFile(document->path(), path)))
      return document.get();
  return nullptr;
}

const Server::Reading& Server::readingOf(Document& document) {
  Reading& reading = m_readings[document.uri()];
  if (reading.version == document.version() && !reading.lines.empty()) return reading;
  reading.version = document.version();
  reading.lines = splitLines(document.text(), document.lines());
  reading.layout = codeLayout(reading.lines, QFileInfo(document.path()).fileName());
  const auto* layout = std::get_if<CodeLayout>(&reading.layout);
  reading.outline = layout ? readOutline(reading.lines, layout->firstCodeLine) : Outline{};
  return reading;
}

QString Server::projectFor(const QString& modulePath) {
  const auto cached = m_projects.constFind(modulePath);
  if (cached != m_projects.constEnd()) return *cached;
  const QString project = projectOf(modulePath);
  m_projects.insert(modulePath, project);
  return project;
}

// ---------------------------------------------------------------------------------------------------
// Documents and diagnostics

void Server::didOpen(const QJsonObject& params) {
  const QJsonObject item = params.value(QLatin1StringView("textDocument")).toObject();
  const QString uri = item.value(QLatin1StringView("uri")).toString();
  if (uri.isEmpty()) return;
  auto document = std::make_unique<Document>(uri, pathOfUri(uri).value_or(QString()),
                                             item.value(QLatin1StringView("text")).toString(),
                                             item.value(QLatin1StringView("version")).toInt());
  Document& opened = *document;
  m_documents[uri] = std::move(document);
  m_readings.erase(uri);
  if (opened.path().isEmpty()) return;
  if (isListingFile(opened.path())) {
    publishProjectDiagnostics(opened.path());
    return;
  }
  publishDiagnostics(opened);
  if (const QString project = projectFor(opened.path()); !project.isEmpty()) {
    publishProjectDiagnostics(project);
    if (const QString group = groupOf(project); !group.isEmpty()) publishProjectDiagnostics(group);
  }
}

void Server::didChange(const QJsonObject& params) {
  const QJsonObject item = params.value(QLatin1StringView("textDocument")).toObject();
  const auto found = m_documents.find(item.value(QLatin1StringView("uri")).toString());
  if (found == m_documents.end()) return;
  Document& document = *found->second;
  m_readings.erase(document.uri());  // it points into the text
  for (const QJsonValue change : params.value(QLatin1StringView("contentChanges")).toArray())
    if (!document.applyChange(change.toObject())) return;
  document.setVersion(item.value(QLatin1StringView("version")).toInt(document.version() + 1));
  if (!document.path().isEmpty() && isModuleFile(document.path())) publishDiagnostics(document);
}

void Server::didClose(const QJsonObject& params) {
  const QString uri =
      params.value(QLatin1StringView("textDocument")).toObject().value(QLatin1StringView("uri")).toString();
  if (m_documents.erase(uri) == 0) return;
  m_readings.erase(uri);
  m_sink(
      notification(QStringLiteral("textDocument/publishDiagnostics"),
                   QJsonObject{{QStringLiteral("uri"), uri}, {QStringLiteral("diagnostics"), QJsonArray()}}));
}

void Server::publishDiagnostics(Document& document) {
  QJsonArray diagnostics;
  const auto add = [&](const Range& range, int severity, const QString& message) {
    diagnostics.append(QJsonObject{{QStringLiteral("range"), toJson(range)},
                                   {QStringLiteral("severity"), severity},
                                   {QStringLiteral("source"), QStringLiteral("quimbel")},
                                   {QStringLiteral("message"), message}});
  };
  const Reading& reading = readingOf(document);
  for (size_t i = 0; i < reading.lines.size(); ++i)
    if (reading.lines[i].size() > kLongestLine)
      add({{int(i), kLongestLine}, {int(i), int(reading.lines[i].size())}}, 1,
          QStringLiteral("line of %1 characters: the IDE refuses lines longer than 1023")
              .arg(reading.lines[i].size()));
  if (const auto* failure = std::get_if<Failure>(&reading.layout)) add({{0, 0}, {0, 0}}, 1, failure->message);
  for (const Imbalance& imbalance : reading.outline.imbalances)
    add({{imbalance.line, imbalance.column}, {imbalance.line, imbalance.column + imbalance.length}}, 2,
        imbalance.message);
  m_sink(notification(QStringLiteral("textDocument/publishDiagnostics"),
                      QJsonObject{{QStringLiteral("uri"), document.uri()},
                                  {QStringLiteral("version"), document.version()},
                                  {QStringLiteral("diagnostics"), diagnostics}}));
}

void Server::publishProjectDiagnostics(const QString& listingPath) {
  const bool group =
      QFileInfo(listingPath).suffix().compare(QLatin1StringView("vbg"), Qt::CaseInsensitive) == 0;
  const auto listing = group ? readGroup(listingPath) : readProject(listingPath);
  QJsonArray diagnostics;
  const auto add = [&](int line, const QString& message) {
    diagnostics.append(QJsonObject{{QStringLiteral("range"), toJson(Range{{line, 0}, {line + 1, 0}})},
                                   {QStringLiteral("severity"), 1},
                                   {QStringLiteral("source"), QStringLiteral("quimbel")},
                                   {QStringLiteral("message"), message}});
  };
  if (const auto* failure = std::get_if<Failure>(&listing))
    add(0, failure->message);
  else
    for (const MissingEntry& missing : std::get<ProjectListing>(listing).missing)
      add(missing.line, QStringLiteral("file not found: %1").arg(missing.entry));
  m_sink(notification(QStringLiteral("textDocument/publishDiagnostics"),
                      QJsonObject{{QStringLiteral("uri"), uriOfPath(listingPath)},
                                  {QStringLiteral("diagnostics"), diagnostics}}));
}

// ---------------------------------------------------------------------------------------------------
// Formatting and code actions

Server::Result Server::formatting(const QJsonObject& params, bool range) {
  const auto found = documentOf(params);
  if (const auto* failure = std::get_if<Failure>(&found)) return *failure;
  Document& document = *std::get<Document*>(found);
  if (!isModuleFile(document.path()))
    return Failure{kRequestFailed, QStringLiteral("%1 is no VB6 module file").arg(document.path())};
  std::optional<Range> lines;
  if (range && !(lines = rangeFrom(params.value(QLatin1StringView("range")))))
    return invalidParams(QStringLiteral("no range"));
  const auto style = styleFor(document.path(), params.value(QLatin1StringView("options")).toObject());
  if (const auto* failure = std::get_if<Failure>(&style)) return *failure;
  auto edits = m_rewriter.rewrite(
      {document.path(), document.text(), Rewrite::Indent, std::get<codestyle::Style>(style), QString()});
  if (const auto* failure = std::get_if<Failure>(&edits)) return *failure;
  std::vector<TextEdit>& all = std::get<std::vector<TextEdit>>(edits);
  // The whole module is indented (a line's level depends on the lines above it); a range keeps the edits
  // of its lines (a range ending at column 0 leaves that line out).
  if (lines) {
    const int last = lines->end.character == 0 && lines->end.line > lines->start.line ? lines->end.line - 1
                                                                                      : lines->end.line;
    std::erase_if(all, [&](const TextEdit& edit) {
      return edit.range.start.line < lines->start.line || edit.range.start.line > last;
    });
  }
  return JsonText{editsJson(all)};
}

Server::Result Server::codeActions(const QJsonObject& params) {
  const auto found = documentOf(params);
  if (const auto* failure = std::get_if<Failure>(&found)) return *failure;
  Document& document = *std::get<Document*>(found);
  if (!isModuleFile(document.path())) return QJsonArray();
  const auto at = rangeFrom(params.value(QLatin1StringView("range")));
  if (!at) return invalidParams(QStringLiteral("no range"));
  QStringList only;
  for (const QJsonValue kind :
       params.value(QLatin1StringView("context")).toObject().value(QLatin1StringView("only")).toArray())
    only << kind.toString();

  // The scopes: the procedure at the start of the range, the module, the project listing it.
  QString procedure;
  for (const Symbol& symbol : readingOf(document).outline.symbols)
    if ((symbol.kind == SymbolKind::Function || symbol.kind == SymbolKind::Property) &&
        symbol.detail != QLatin1StringView("Declare") && symbol.line <= at->start.line &&
        at->start.line <= symbol.endLine)
      procedure = symbol.name;
  const QString project = projectFor(document.path());
  struct Scope {
    QString id;
    QString shown;
  };
  std::vector<Scope> scopes;
  if (!procedure.isEmpty())
    scopes.push_back({QStringLiteral("procedure"), QStringLiteral("procedure ") + procedure});
  scopes.push_back(
      {QStringLiteral("module"), QStringLiteral("module ") + QFileInfo(document.path()).completeBaseName()});
  if (!project.isEmpty())
    scopes.push_back(
        {QStringLiteral("project"), QStringLiteral("project ") + QFileInfo(project).completeBaseName()});

  QJsonArray actions;
  for (const ActionKind& action : kActions) {
    const QString kind = kindPrefix() + QLatin1StringView(action.id);
    if (!only.isEmpty() && std::none_of(only.begin(), only.end(), [&](const QString& wanted) {
          return kind == wanted || kind.startsWith(wanted + u'.');
        }))
      continue;
    for (const Scope& scope : scopes) {
      QJsonObject item{
          {QStringLiteral("title"),
           QStringLiteral("%1 (%2)").arg(QLatin1StringView(action.title), scope.shown)},
          {QStringLiteral("kind"), kind},
          {QStringLiteral("data"), QJsonObject{{QStringLiteral("uri"), document.uri()},
                                               {QStringLiteral("action"), QLatin1StringView(action.id)},
                                               {QStringLiteral("scope"), scope.id},
                                               {QStringLiteral("procedure"), procedure},
                                               {QStringLiteral("project"), project}}}};
      if (!m_resolveEdits) {
        const Result resolved = resolveCodeAction(item);
        if (const auto* failure = std::get_if<Failure>(&resolved)) return *failure;
        item = std::get<QJsonValue>(resolved).toObject();
      }
      actions.append(item);
    }
  }
  return actions;
}

Server::Result Server::resolveCodeAction(QJsonObject action) {
  const QJsonObject data = action.value(QLatin1StringView("data")).toObject();
  const QString id = data.value(QLatin1StringView("action")).toString();
  const auto kind = std::find_if(std::begin(kActions), std::end(kActions),
                                 [&](const ActionKind& known) { return id == QLatin1StringView(known.id); });
  const QString scope = data.value(QLatin1StringView("scope")).toString();
  const auto found = m_documents.find(data.value(QLatin1StringView("uri")).toString());
  if (kind == std::end(kActions) || found == m_documents.end() || found->second->path().isEmpty())
    return invalidParams(QStringLiteral("not a code action of this server, or its document was closed"));
  Document& document = *found->second;

  // Each module on its own: open ones as the editor holds them, the others as their files are.
  struct Module {
    QString uri;
    QString path;
    QString text;
  };
  std::vector<Module> modules;
  if (scope == QLatin1StringView("project")) {
    const auto listing = readProject(data.value(QLatin1StringView("project")).toString());
    if (const auto* failure = std::get_if<Failure>(&listing)) return *failure;
    for (const QString& path : std::get<ProjectListing>(listing).modules) {
      if (!isModuleFile(path)) continue;
      if (const Document* open = openDocument(path)) {
        modules.push_back({open->uri(), path, open->text()});
        continue;
      }
      auto text = readModuleText(path);
      if (const auto* failure = std::get_if<Failure>(&text)) return *failure;
      modules.push_back({uriOfPath(path), path, std::get<QString>(std::move(text))});
    }
  } else {
    modules.push_back({document.uri(), document.path(), document.text()});
  }
  QJsonObject changes;
  for (const Module& module : modules) {
    const auto style = styleFor(module.path);
    if (const auto* failure = std::get_if<Failure>(&style)) return *failure;
    const auto edits = m_rewriter.rewrite(
        {module.path, module.text, kind->rewrite, std::get<codestyle::Style>(style),
         scope == QLatin1StringView("procedure") ? data.value(QLatin1StringView("procedure")).toString()
                                                 : QString()});
    if (const auto* failure = std::get_if<Failure>(&edits)) return *failure;
    if (!std::get<std::vector<TextEdit>>(edits).empty())
      changes.insert(module.uri,
                     QJsonDocument::fromJson(editsJson(std::get<std::vector<TextEdit>>(edits))).array());
  }
  action.insert(QStringLiteral("edit"), QJsonObject{{QStringLiteral("changes"), changes}});
  return action;
}

// ---------------------------------------------------------------------------------------------------
// Reading the code

Server::Result Server::documentSymbols(const QJsonObject& params) {
  const auto found = documentOf(params);
  if (const auto* failure = std::get_if<Failure>(&found)) return *failure;
  if (!isModuleFile(std::get<Document*>(found)->path())) return QJsonArray();
  const Reading& reading = readingOf(*std::get<Document*>(found));
  if (const auto* failure = std::get_if<Failure>(&reading.layout)) return *failure;
  QJsonArray symbols;
  for (const Symbol& symbol : reading.outline.symbols)
    symbols.append(symbolJson(symbol, reading.lines));
  return symbols;
}

Server::Result Server::foldingRanges(const QJsonObject& params) {
  const auto found = documentOf(params);
  if (const auto* failure = std::get_if<Failure>(&found)) return *failure;
  if (!isModuleFile(std::get<Document*>(found)->path())) return QJsonArray();
  const Reading& reading = readingOf(*std::get<Document*>(found));
  if (const auto* failure = std::get_if<Failure>(&reading.layout)) return *failure;
  std::vector<Fold> folds = reading.outline.folds;
  std::sort(folds.begin(), folds.end(), [](const Fold& a, const Fold& b) {
    return std::tie(a.startLine, a.endLine) < std::tie(b.startLine, b.endLine);
  });
  QJsonArray ranges;
  for (size_t i = 0; i < folds.size(); ++i) {
    if (i > 0 && folds[i].startLine == folds[i - 1].startLine && folds[i].endLine == folds[i - 1].endLine)
      continue;
    ranges.append(QJsonObject{{QStringLiteral("startLine"), folds[i].startLine},
                              {QStringLiteral("endLine"), folds[i].endLine}});
  }
  return ranges;
}

QStringList Server::modulesAround(const Document& document) {
  const QString project = projectFor(document.path());
  if (project.isEmpty()) return {document.path()};
  QStringList projects{project};
  if (const QString group = groupOf(project); !group.isEmpty())
    if (const auto listing = readGroup(group); std::holds_alternative<ProjectListing>(listing))
      projects = std::get<ProjectListing>(listing).modules;
  QStringList modules;
  for (const QString& path : projects)
    if (const auto listing = readProject(path); std::holds_alternative<ProjectListing>(listing))
      for (const QString& module : std::get<ProjectListing>(listing).modules)
        if (isModuleFile(module)) modules << module;
  return modules;
}

Server::Result Server::workspaceSymbols(const QJsonObject& params) {
  const QString query = params.value(QLatin1StringView("query")).toString();
  // The groups and projects of the open modules, each module once.
  QStringList modules;
  QSet<QString> seen;
  for (const auto& [uri, document] : m_documents) {
    if (document->path().isEmpty() || !isModuleFile(document->path())) continue;
    for (const QString& module : modulesAround(*document))
      if (!seen.contains(module)) {
        seen.insert(module);
        modules << module;
      }
  }
  // Modules not open are read from their files, on every core, once until they change.
  std::vector<QString> stale;
  for (const QString& path : modules) {
    if (openDocument(path)) continue;
    const QFileInfo file(path);
    const auto cached = m_index.constFind(path);
    if (cached == m_index.constEnd() || cached->modified != file.lastModified() ||
        cached->size != file.size())
      stale.push_back(path);
  }
  std::vector<Indexed> read(stale.size());
  std::vector<std::exception_ptr> failures;
  fileio::parallelFor(
      stale.size(),
      [&](size_t i) {
        const QFileInfo file(stale[i]);
        read[i].modified = file.lastModified();
        read[i].size = file.size();
        const auto text = readModuleText(stale[i]);
        if (!std::holds_alternative<QString>(text)) return;
        const QString& content = std::get<QString>(text);
        const LineIndex index(content);
        const auto lines = splitLines(content, index);
        const auto layout = codeLayout(lines, file.fileName());
        if (const auto* code = std::get_if<CodeLayout>(&layout))
          read[i].symbols = readOutline(lines, code->firstCodeLine).symbols;
      },
      failures);
  for (size_t i = 0; i < stale.size(); ++i)
    m_index.insert(stale[i], std::move(read[i]));

  QJsonArray found;
  const auto add = [&](const Symbol& symbol, const QString& uri, const QString& container) {
    if (found.size() >= kMostSymbols ||
        (!query.isEmpty() && !symbol.name.contains(query, Qt::CaseInsensitive)))
      return;
    found.append(
        QJsonObject{{QStringLiteral("name"), symbol.name},
                    {QStringLiteral("kind"), int(symbol.kind)},
                    {QStringLiteral("containerName"), container},
                    {QStringLiteral("location"),
                     QJsonObject{{QStringLiteral("uri"), uri},
                                 {QStringLiteral("range"),
                                  toJson(Range{{symbol.line, symbol.nameColumn},
                                               {symbol.line, symbol.nameColumn + symbol.nameLength}})}}}});
  };
  for (const QString& path : modules) {
    Document* open = openDocument(path);
    const std::vector<Symbol>& symbols = open ? readingOf(*open).outline.symbols : m_index[path].symbols;
    const QString uri = open ? open->uri() : uriOfPath(path);
    const QString module = QFileInfo(path).completeBaseName();
    for (const Symbol& symbol : symbols) {
      add(symbol, uri, module);
      for (const Symbol& child : symbol.children)
        add(child, uri, symbol.name);
    }
  }
  return found;
}

Server::Result Server::references(const QJsonObject& params) {
  const auto found = documentOf(params);
  if (const auto* failure = std::get_if<Failure>(&found)) return *failure;
  Document& document = *std::get<Document*>(found);
  const auto position = positionFrom(params.value(QLatin1StringView("position")));
  if (!position) return invalidParams(QStringLiteral("no position"));
  if (!isModuleFile(document.path())) return QJsonValue(QJsonValue::Null);
  const QString word = identifierAt(document.line(position->line), position->character);
  if (word.isEmpty()) return QJsonValue(QJsonValue::Null);

  // The project as the IDE opens it, with the open modules as the editor holds them.
  const auto vbe = host::VbeImpl::create();
  const QString project = projectFor(document.path());
  if (project.isEmpty())
    vbe->openModuleFile(document.path());
  else
    vbe->openProject(project);
  for (const auto& loaded : vbe->projects())
    for (const auto& component : loaded->components()) {
      Document* open = component->codeModule() ? openDocument(component->filePath()) : nullptr;
      if (!open) continue;
      const Reading& reading = readingOf(*open);
      const auto* layout = std::get_if<CodeLayout>(&reading.layout);
      if (!layout) continue;
      QStringList code;
      for (const int line : layout->fileLineOfCode)
        code << reading.lines[size_t(line)].toString();
      const auto module = component->codeModule();
      if (module->CountOfLines() > 0) module->DeleteLines(1, module->CountOfLines());
      if (!code.isEmpty()) module->InsertLines(1, code.join(QStringLiteral("\r\n")));
    }
  walk::WalkContext context(QStringLiteral("quimbel"), nullptr, nullptr);
  Rows rows;
  find::FindWalk(context, *vbe, rows).Search(find::SearchScope::AllProjects, {word, true, false, false});

  QJsonArray locations;
  QHash<QString, std::vector<int>> fileLines;  // by module file: the file line of each code line
  for (const find::FoundRow& row : rows.rows) {
    const auto component = std::dynamic_pointer_cast<host::ComponentImpl>(row.item.Component);
    if (!component) continue;
    const QString path = component->filePath();
    if (!fileLines.contains(path)) {
      std::vector<int>& map = fileLines[path];
      Document* open = openDocument(path);
      QString text;
      if (!open) {
        auto read = readModuleText(path);
        if (!std::holds_alternative<QString>(read)) continue;
        text = std::get<QString>(std::move(read));
      }
      const QString& content = open ? open->text() : text;
      const LineIndex index(content);
      const auto layout = codeLayout(splitLines(content, index), QFileInfo(path).fileName());
      if (const auto* code = std::get_if<CodeLayout>(&layout)) map = code->fileLineOfCode;
    }
    const std::vector<int>& map = fileLines[path];
    if (row.item.startline < 1 || size_t(row.item.startline) > map.size()) continue;
    const int line = map[size_t(row.item.startline) - 1];
    const Document* open = openDocument(path);
    locations.append(QJsonObject{{QStringLiteral("uri"), open ? open->uri() : uriOfPath(path)},
                                 {QStringLiteral("range"), toJson(Range{{line, row.item.startcol - 1},
                                                                        {line, row.item.endcol - 1}})}});
  }
  return locations;
}

// ---------------------------------------------------------------------------------------------------

int serve(int input, int output, const QString& version) {
  bool writeFailed = false;
  const auto writeAll = [&](const QByteArray& bytes) {
    qsizetype done = 0;
    while (!writeFailed && done < bytes.size()) {
      const ssize_t written = ::write(output, bytes.constData() + done, size_t(bytes.size() - done));
      if (written < 0 && errno == EINTR) continue;
      if (written <= 0)
        writeFailed = true;
      else
        done += written;
    }
  };
  Server server([&](const QByteArray& body) { writeAll(frame(body)); }, version);
  MessageReader reader;
  char buffer[65536];
  while (!server.exited() && !writeFailed) {
    const ssize_t count = ::read(input, buffer, sizeof buffer);
    if (count < 0 && errno == EINTR) continue;
    if (count <= 0) return 1;  // the client went away without exit
    reader.feed(QByteArrayView(buffer, count));
    bool framingError = false;
    while (!server.exited()) {
      const auto body = reader.next(&framingError);
      if (framingError) {
        server.framingError();
        continue;
      }
      if (!body) break;
      server.handle(*body);
    }
    server.idle();
  }
  return writeFailed ? 1 : server.exitCode();
}

}  // namespace lsp
