// SPDX-License-Identifier: MIT
// The language server: the protocol's life cycle and each request in-process on a copy of the example
// group, and Neovim as a real client whose written file must hold what the command-line tool writes.
#include "host/files/ansi.h"
#include "lsp/server.h"
#include "testproject.h"

#include <gtest/gtest.h>

#include <QDir>
#include <QFile>
#include <QJsonArray>
#include <QJsonDocument>
#include <QProcess>
#include <QSet>
#include <QStandardPaths>

namespace {

using host::test::ExampleCopy;
using host::test::readBytes;
using host::test::writeBytes;

QString uri(const QString& path) {
  return lsp::uriOfPath(path);
}

QString cp1252(const QString& path) {
  return QString::fromLatin1(readBytes(path));  // the example's accents are Latin-1 letters
}

class Client {
 public:
  Client()
      : m_server(
            [this](const QByteArray& body) { m_received.push_back(QJsonDocument::fromJson(body).object()); },
            u"test"_qs) {
    qputenv("QUIMBEL_CONFIG_DIR", m_home.path().toLocal8Bit());
  }

  QJsonObject request(const QString& method, const QJsonObject& params = {}) {
    send({{u"jsonrpc"_qs, u"2.0"_qs}, {u"id"_qs, ++m_id}, {u"method"_qs, method}, {u"params"_qs, params}});
    for (const QJsonObject& message : m_received)
      if (message.value(u"id"_qs) == m_id) return message;
    ADD_FAILURE() << "no answer to " << method.toStdString();
    return {};
  }
  QJsonValue result(const QString& method, const QJsonObject& params = {}) {
    const QJsonObject answer = request(method, params);
    EXPECT_FALSE(answer.contains(u"error"_qs)) << QJsonDocument(answer).toJson().toStdString();
    return answer.value(u"result"_qs);
  }
  void notify(const QString& method, const QJsonObject& params) {
    send({{u"jsonrpc"_qs, u"2.0"_qs}, {u"method"_qs, method}, {u"params"_qs, params}});
  }
  void send(const QJsonObject& message) { raw(QJsonDocument(message).toJson()); }
  void raw(const QByteArray& body) {
    m_received.clear();
    m_server.handle(body);
  }
  void start() { result(u"initialize"_qs, {{u"capabilities"_qs, QJsonObject()}}); }
  void open(const QString& path, const QString& text) {
    notify(u"textDocument/didOpen"_qs, {{u"textDocument"_qs, QJsonObject{{u"uri"_qs, uri(path)},
                                                                         {u"languageId"_qs, u"vb"_qs},
                                                                         {u"version"_qs, 1},
                                                                         {u"text"_qs, text}}}});
  }
  /// The diagnostics last published for `path`.
  QJsonArray diagnostics(const QString& path) const {
    QJsonArray found;
    for (const QJsonObject& message : m_received)
      if (message.value(u"method"_qs) == u"textDocument/publishDiagnostics"_qs &&
          message.value(u"params"_qs)[u"uri"_qs] == uri(path))
        found = message.value(u"params"_qs)[u"diagnostics"_qs].toArray();
    return found;
  }
  lsp::Server& server() { return m_server; }

 private:
  QTemporaryDir m_home;
  lsp::Server m_server;
  std::vector<QJsonObject> m_received;
  int m_id = 0;
};

QJsonObject document(const QString& path) {
  return {{u"textDocument"_qs, QJsonObject{{u"uri"_qs, uri(path)}}}};
}

int errorCode(const QJsonObject& answer) {
  return answer.value(u"error"_qs)[u"code"_qs].toInt();
}

TEST(LanguageServer, LifeCycleAndBadInputAnswerWithTheProtocolsCodes) {
  Client client;
  EXPECT_EQ(errorCode(client.request(u"textDocument/documentSymbol"_qs)), lsp::kServerNotInitialized);
  const QJsonValue capabilities = client.result(u"initialize"_qs)[u"capabilities"_qs];
  EXPECT_EQ(capabilities[u"positionEncoding"_qs], u"utf-16"_qs);
  EXPECT_EQ(errorCode(client.request(u"initialize"_qs)), lsp::kInvalidRequest);
  EXPECT_EQ(errorCode(client.request(u"textDocument/hover"_qs)), lsp::kMethodNotFound);
  EXPECT_EQ(errorCode(client.request(u"textDocument/formatting"_qs, document(u"/nowhere.bas"_qs))),
            lsp::kInvalidParams);
  for (const QByteArray& bad :
       {QByteArray("{\"jsonrpc\": "), QByteArray("[1, 2]"), QByteArray("{\"id\": {}}")}) {
    client.raw(bad);  // answered with id null; nothing else breaks
  }
  client.raw("{bad");
  EXPECT_FALSE(client.server().exited());
  EXPECT_TRUE(client.result(u"shutdown"_qs).isNull());
  EXPECT_EQ(errorCode(client.request(u"workspace/symbol"_qs)), lsp::kInvalidRequest);
  client.notify(u"exit"_qs, {});
  EXPECT_TRUE(client.server().exited());
  EXPECT_EQ(client.server().exitCode(), 0);

  Client abrupt;
  abrupt.start();
  abrupt.notify(u"exit"_qs, {});
  EXPECT_EQ(abrupt.server().exitCode(), 1);

  // Framing: a message cut anywhere comes out whole, once; a header without a length is dropped.
  lsp::MessageReader reader;
  const QByteArray stream = "Content-Type: x\r\n\r\n" + lsp::frame(R"({"a":"é"})") + lsp::frame("{}");
  bool framingError = false;
  std::vector<QByteArray> bodies;
  int errors = 0;
  for (const char byte : stream) {
    reader.feed(QByteArrayView(&byte, 1));
    while (true) {
      const auto body = reader.next(&framingError);
      errors += framingError;
      if (!body && !framingError) break;
      if (body) bodies.push_back(*body);
    }
  }
  EXPECT_EQ(errors, 1);
  ASSERT_EQ(bodies.size(), 2u);
  EXPECT_EQ(QJsonDocument::fromJson(bodies[0])[u"a"_qs], u"é"_qs);
}

TEST(LanguageServer, ReadsTheOpenModuleAndItsProject) {
  ExampleCopy copy;
  const QString path = copy.path(u"Loja/clsItemPedido.cls"_qs);
  Client client;
  client.start();
  QString text = cp1252(path);
  client.open(path, text);
  EXPECT_TRUE(client.diagnostics(path).isEmpty());

  // The outline: procedures with their kinds, declarations; folds within the file.
  QSet<QString> names;
  for (const QJsonValue symbol : client.result(u"textDocument/documentSymbol"_qs, document(path)).toArray())
    names << symbol[u"name"_qs].toString() + u' ' + QString::number(symbol[u"kind"_qs].toInt());
  EXPECT_TRUE(names.contains(u"mProduto 13"_qs) && names.contains(u"Produto 7"_qs))
      << names.values().join(u", ").toStdString();
  const int lines = int(text.count(u'\n')) + 1;
  const QJsonArray folds = client.result(u"textDocument/foldingRange"_qs, document(path)).toArray();
  EXPECT_FALSE(folds.isEmpty());
  for (const QJsonValue fold : folds)
    EXPECT_TRUE(fold[u"startLine"_qs].toInt() <= fold[u"endLine"_qs].toInt() &&
                fold[u"endLine"_qs].toInt() < lines);

  // References are the whole-word occurrences the command line's find lists in the project.
  QProcess find;
  find.start(QStringLiteral(QUIMBEL_BINARY),
             {u"find"_qs, u"--json"_qs, u"-w"_qs, u"mProduto"_qs, copy.path(u"Loja/Loja.vbp"_qs)});
  ASSERT_TRUE(find.waitForFinished(60000));
  QSet<QString> expected;
  for (const QJsonValue row : QJsonDocument::fromJson(find.readAllStandardOutput()).array())
    expected << u"%1:%2:%3"_qs
                    .arg(uri(copy.path(u"Loja/"_qs + QFileInfo(row[u"path"_qs].toString()).fileName())))
                    .arg(row[u"file_line"_qs].toInt() - 1)
                    .arg(row[u"column"_qs].toInt() - 1);
  QSet<QString> found;
  QJsonObject at = document(path);
  at.insert(u"position"_qs, QJsonObject{{u"line"_qs, 17}, {u"character"_qs, 10}});
  for (const QJsonValue location : client.result(u"textDocument/references"_qs, at).toArray())
    found << u"%1:%2:%3"_qs.arg(location[u"uri"_qs].toString())
                 .arg(location[u"range"_qs][u"start"_qs][u"line"_qs].toInt())
                 .arg(location[u"range"_qs][u"start"_qs][u"character"_qs].toInt());
  EXPECT_EQ(found, expected);
  EXPECT_FALSE(found.isEmpty());

  // The workspace is the group: a procedure of the other project is found.
  const QJsonArray symbols =
      client.result(u"workspace/symbol"_qs, {{u"query"_qs, u"NomeDoMes"_qs}}).toArray();
  ASSERT_FALSE(symbols.isEmpty());
  EXPECT_TRUE(symbols[0][u"location"_qs][u"uri"_qs].toString().contains(u"Utilitarios"_qs));

  // An edit in the middle of a line, as editors send them; then the diagnostics of what it broke.
  const QJsonObject change{
      {u"range"_qs, QJsonObject{{u"start"_qs, QJsonObject{{u"line"_qs, 22}, {u"character"_qs, 0}}},
                                {u"end"_qs, QJsonObject{{u"line"_qs, 22}, {u"character"_qs, 0}}}}},
      {u"text"_qs,
       u"    If mProduto = \"\" Then\r\n"_qs + u"    x = \""_qs + QString(1100, u'x') + u"\"\r\n"_qs}};
  client.notify(u"textDocument/didChange"_qs,
                {{u"textDocument"_qs, QJsonObject{{u"uri"_qs, uri(path)}, {u"version"_qs, 2}}},
                 {u"contentChanges"_qs, QJsonArray{change}}});
  const QJsonArray problems = client.diagnostics(path);
  ASSERT_EQ(problems.size(), 2);
  EXPECT_TRUE(problems[0][u"message"_qs].toString().contains(u"1023"_qs));
  EXPECT_EQ(problems[0][u"range"_qs][u"start"_qs][u"line"_qs], 23);
  EXPECT_TRUE(problems[1][u"message"_qs].toString().startsWith(u"If is never closed"_qs));

  // A project entry naming a missing file is shown on the project file.
  QFile::remove(copy.path(u"Loja/clsCliente.cls"_qs));
  client.open(copy.path(u"Loja/modPrincipal.bas"_qs), cp1252(copy.path(u"Loja/modPrincipal.bas"_qs)));
  const QJsonArray missing = client.diagnostics(copy.path(u"Loja/Loja.vbp"_qs));
  ASSERT_EQ(missing.size(), 1);
  EXPECT_EQ(missing[0][u"message"_qs], u"file not found: clsCliente.cls"_qs);
}

TEST(LanguageServer, FormatsAndNumbersOnlyWhereAsked) {
  QTemporaryDir folder;  // a module that no project lists
  const QString path = folder.filePath(u"Solto.bas"_qs);
  const QString text =
      u"Attribute VB_Name = \"Solto\"\r\nPublic Sub A()\r\nIf x Then\r\ny = 1\r\nEnd If\r\nEnd Sub\r\n"
      "Sub B()\r\nz = 2\r\nEnd Sub\r\n"_qs;
  Client client;
  client.start();
  client.open(path, text);
  QJsonObject params = document(path);
  params.insert(u"options"_qs, QJsonObject{{u"tabSize"_qs, 2}, {u"insertSpaces"_qs, true}});
  const QJsonArray all = client.result(u"textDocument/formatting"_qs, params).toArray();
  // Only leading blanks: every edit inserts blanks at column 0.
  ASSERT_EQ(all.size(), 4);
  for (const QJsonValue edit : all)
    EXPECT_TRUE(edit[u"range"_qs][u"start"_qs][u"character"_qs] == 0 &&
                edit[u"newText"_qs].toString().trimmed().isEmpty());
  params.insert(u"range"_qs, QJsonObject{{u"start"_qs, QJsonObject{{u"line"_qs, 6}, {u"character"_qs, 0}}},
                                         {u"end"_qs, QJsonObject{{u"line"_qs, 8}, {u"character"_qs, 0}}}});
  const QJsonArray some = client.result(u"textDocument/rangeFormatting"_qs, params).toArray();
  ASSERT_EQ(some.size(), 1);
  EXPECT_EQ(some[0], all[3]);

  // Outside any project: the procedure and the module, no project.
  QJsonObject where = document(path);
  where.insert(u"range"_qs, params.value(u"range"_qs));
  where.insert(u"context"_qs, QJsonObject{{u"only"_qs, QJsonArray{u"source.quimbel.number"_qs}}});
  QStringList titles;
  for (const QJsonValue action : client.result(u"textDocument/codeAction"_qs, where).toArray())
    titles << action[u"title"_qs].toString();
  EXPECT_EQ(titles, QStringList({u"Number lines (procedure B)"_qs, u"Number lines (module Solto)"_qs}));

  // A character the code page cannot hold fails the request; the module is left to the user.
  client.open(path, text + u"' \u0100\r\n"_qs);
  const QJsonObject refused = client.request(u"textDocument/formatting"_qs, params);
  EXPECT_EQ(errorCode(refused), lsp::kRequestFailed);
  EXPECT_TRUE(refused[u"error"_qs][u"message"_qs].toString().contains(u"line 10"_qs));
}

// The outline's reading of blocks: what balances, what does not, and what each shape declares.
TEST(LanguageServer, OutlineTellsWhichBlocksDoNotBalance) {
  struct Case {
    const char* code;
    const char* symbols;     // name:kind@column of the name, in order
    const char* imbalances;  // line:message start, in order
  };
  const Case cases[] = {
      {"Sub A()\nIf x Then y = 1 Else y = 2\nIf x Then ' block\nEnd If\nEnd Sub", "A:12@4", ""},
      {"Sub A()\n10 If x Then\n20 End If\nFor i = 1 To 2\nFor j = 1 To 2\nNext j, i ' a, b\nEnd Sub",
       "A:12@4", ""},
      {"Sub A()\nIf x And _\n  y Then\nEnd Sub", "A:12@4", "1:If is never closed"},
      {"Sub A()\nFor i = 1 To 2: Next\nEnd Sub", "A:12@4", "1:For is never closed"},
      {"Sub A()\nWith x\nEnd If\nEnd With\nEnd Sub", "A:12@4", "2:End If closes no block"},
      {"#If W Then\nSub A(x As Long)\n#Else\nSub A(x As Integer)\n#End If\nx = 1\nEnd Sub", "A:12@4", ""},
      {"Sub A()\nx = 1\nFunction B()\nEnd Function\n#If W Then", "A:12@4 B:12@9",
       "0:A has no End|4:#If is never closed"},
      {"Private Type T\n  a As Long\nEnd Type\nPublic Const K = 1, L = 2\nDim D As Long\nProperty Get "
       "Pub()\nEnd Property",
       "T:23@13 K:14@13 L:14@20 D:13@4 Pub:7@13", ""},
      {"Public Enum E\n  One\nSub A()\nEnd Sub", "A:12@4", "0:Enum is never closed"},
  };
  for (const Case& c : cases) {
    const QString code = QString::fromLatin1(c.code);
    const lsp::LineIndex index(code);
    const lsp::Outline outline = lsp::readOutline(lsp::splitLines(code, index), 0);
    QStringList symbols;
    for (const lsp::Symbol& symbol : outline.symbols)
      symbols << u"%1:%2@%3"_qs.arg(symbol.name).arg(int(symbol.kind)).arg(symbol.nameColumn);
    QStringList imbalances;
    for (const lsp::Imbalance& imbalance : outline.imbalances)
      imbalances << QString::number(imbalance.line) + u':' + imbalance.message;
    EXPECT_EQ(symbols.join(u' '), QLatin1StringView(c.symbols)) << c.code;
    const QStringList expected = QString::fromLatin1(c.imbalances).split(u'|', Qt::SkipEmptyParts);
    ASSERT_EQ(imbalances.size(), expected.size()) << c.code << "\n" << imbalances.join(u'\n').toStdString();
    for (qsizetype i = 0; i < expected.size(); ++i)
      EXPECT_TRUE(imbalances[i].startsWith(expected[i])) << imbalances[i].toStdString();
    for (const lsp::Fold& fold : outline.folds)
      EXPECT_TRUE(fold.startLine <= fold.endLine && fold.endLine < index.count()) << c.code;
  }
}

// A project-wide action, its edits asked for when chosen: the modules the editor has not opened are read
// in the code page, and the edits give the bytes `quimbel numindent` writes.
TEST(LanguageServer, ProjectActionsEditWhatTheCommandLineRewrites) {
  ExampleCopy editor;
  ExampleCopy tool;
  Client client;
  client.result(
      u"initialize"_qs,
      {{u"capabilities"_qs,
        QJsonObject{
            {u"textDocument"_qs,
             QJsonObject{{u"codeAction"_qs,
                          QJsonObject{{u"resolveSupport"_qs,
                                       QJsonObject{{u"properties"_qs, QJsonArray{u"edit"_qs}}}}}}}}}}});
  const QString path = editor.path(u"Loja/modPrincipal.bas"_qs);
  client.open(path, host::decodeAnsi(readBytes(path)));
  QJsonObject where = document(path);
  where.insert(u"range"_qs, QJsonObject{{u"start"_qs, QJsonObject{{u"line"_qs, 0}, {u"character"_qs, 0}}},
                                        {u"end"_qs, QJsonObject{{u"line"_qs, 0}, {u"character"_qs, 0}}}});
  where.insert(u"context"_qs, QJsonObject{{u"only"_qs, QJsonArray{u"source.quimbel.numindent"_qs}}});
  QJsonObject chosen;
  for (const QJsonValue action : client.result(u"textDocument/codeAction"_qs, where).toArray())
    if (action[u"title"_qs] == u"Number and indent (project Loja)"_qs) chosen = action.toObject();
  ASSERT_FALSE(chosen.isEmpty());
  EXPECT_FALSE(chosen.contains(u"edit"_qs));
  const QJsonObject changes =
      client.result(u"codeAction/resolve"_qs, chosen)[u"edit"_qs][u"changes"_qs].toObject();

  QProcess numindent;
  numindent.setProcessEnvironment(QProcessEnvironment::systemEnvironment());
  numindent.start(QStringLiteral(QUIMBEL_BINARY), {u"numindent"_qs, tool.path(u"Loja/Loja.vbp"_qs)});
  ASSERT_TRUE(numindent.waitForFinished(60000));
  ASSERT_EQ(numindent.exitCode(), 0);
  int changed = 0;
  for (const QString& name : QDir(editor.path(u"Loja"_qs)).entryList(QDir::Files)) {
    QString text = host::decodeAnsi(readBytes(editor.path(u"Loja/"_qs + name)));
    const QJsonArray edits = changes.value(uri(editor.path(u"Loja/"_qs + name))).toArray();
    const lsp::LineIndex index(text);
    for (qsizetype i = edits.size(); i-- > 0;) {  // from the end, so that offsets stay valid
      const auto range = lsp::rangeFrom(edits[i][u"range"_qs]);
      const qsizetype from = index.offset(text, range->start);
      text.replace(from, index.offset(text, range->end) - from, edits[i][u"newText"_qs].toString());
    }
    changed += !edits.isEmpty();
    EXPECT_EQ(host::encodeAnsi(text).value_or(QByteArray()), readBytes(tool.path(u"Loja/"_qs + name)))
        << name.toStdString();
  }
  EXPECT_GT(changed, 5);
}

// Neovim formats a module and numbers it through the server and writes it: the bytes are those the
// command-line tool writes (its .editorconfig winning over the editor's tabs).
TEST(LanguageServer, NeovimWritesWhatTheCommandLineWrites) {
  const QString nvim = QStandardPaths::findExecutable(u"nvim"_qs);
  ASSERT_FALSE(nvim.isEmpty()) << "nvim is missing: scripts/install-deps.sh installs Debian's neovim";
  ExampleCopy editor;
  ExampleCopy tool;
  QTemporaryDir home;
  for (const ExampleCopy* copy : {&editor, &tool})
    writeBytes(copy->path(u".editorconfig"_qs), "root = true\n[*]\nindent_style = space\nindent_size = 3\n");
  const QString module = u"Loja/modPrincipal.bas"_qs;
  const QByteArray original = readBytes(editor.path(module));

  QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
  environment.insert(u"QUIMBEL_CONFIG_DIR"_qs, home.filePath(u"config"_qs));
  environment.insert(u"HOME"_qs, home.path());
  environment.insert(u"XDG_STATE_HOME"_qs, home.filePath(u"state"_qs));
  environment.insert(u"QUIMBEL"_qs, QStringLiteral(QUIMBEL_BINARY));
  environment.insert(u"QUIMBEL_MODULE"_qs, editor.path(module));
  environment.insert(u"QUIMBEL_LINE"_qs, u"30"_qs);
  environment.insert(u"QUIMBEL_ACTION"_qs, u"Number lines (module modPrincipal)"_qs);
  const auto run = [&](const QString& program, const QStringList& arguments) {
    QProcess process;
    process.setProcessEnvironment(environment);
    process.start(program, arguments);
    EXPECT_TRUE(process.waitForFinished(120000));
    EXPECT_EQ(process.exitCode(), 0) << process.readAllStandardError().toStdString();
  };
  run(nvim, {u"--headless"_qs, u"--clean"_qs, u"-n"_qs, u"-i"_qs, u"NONE"_qs, u"-c"_qs,
             u"luafile " QUIMBEL_SOURCE_DIR "/tests/lsp/nvim_client.lua"_qs});
  for (const char* command : {"indent", "number"})
    run(QStringLiteral(QUIMBEL_BINARY),
        {QString::fromLatin1(command), u"--module"_qs, u"modPrincipal"_qs, tool.groupFile()});

  const QByteArray written = readBytes(editor.path(module));
  EXPECT_NE(written, original);
  EXPECT_EQ(written, readBytes(tool.path(module)));
  EXPECT_EQ(editor.snapshot().size(), tool.snapshot().size());  // no other file written or left behind
}

}  // namespace
