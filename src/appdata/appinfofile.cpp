// SPDX-License-Identifier: MIT
#include "appdata/appinfofile.h"

#include "common/errors.h"
#include "ide/error.h"

#include <QFile>
#include <QFileInfo>
#include <QTemporaryFile>

#include <sqlite3.h>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <optional>
#include <utility>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace appdata {
namespace {

/// One setting of the cipher that the file's bytes depend on, pinned so that every SQLCipher version reads
/// and writes the same format: each version has defaults of its own (3.x and 4.x differ in page size, key
/// derivation and HMAC), and a file written with one version's defaults is "not a database" to the other.
struct CipherSetting {
  const char* pragma;
  const char* value;
  /// What reading the pragma back gives once it took.
  const char* readBack;
  /// The library versions (major) that have the setting; the others fix it at the same value.
  int fromMajor;
  int untilMajor;
};

// AES-256-CBC with 1,024-byte pages, a PBKDF2-HMAC-SHA1 key from 4,000 rounds (SQLCipher 2's count: the
// password ships with the program, so stretching it protects nothing, while 3.x's 64,000 rounds alone
// cost some 30 ms at every start), HMAC-SHA1 on every page, no plain-text header. SQLCipher 3 has no
// pragmas for the two algorithms (they are fixed there), SQLCipher 4 none for the HMAC key's rounds
// (fixed at 2, 3.x's default).
constexpr CipherSetting kCipherSettings[] = {
    {"cipher_page_size", "1024", "1024", 3, 99},
    {"kdf_iter", "4000", "4000", 3, 99},
    {"cipher_use_hmac", "ON", "1", 3, 99},
    {"fast_kdf_iter", "2", "2", 3, 3},
    {"cipher_kdf_algorithm", "PBKDF2_HMAC_SHA1", "PBKDF2_HMAC_SHA1", 4, 99},
    {"cipher_hmac_algorithm", "HMAC_SHA1", "HMAC_SHA1", 4, 99},
    {"cipher_plaintext_header_size", "0", "0", 4, 99},
};

constexpr char kSchema[] = R"(BEGIN;
CREATE TABLE "Macros" ("MacroId" VARCHAR(20) COLLATE NOCASE CHECK (length("MacroId") <= 20),
  "Text" TEXT, "Enabled" BOOLEAN);
CREATE TABLE "CopyBuffers" ("CopyBufferId" VARCHAR(20) COLLATE NOCASE CHECK (length("CopyBufferId") <= 20),
  "Text" TEXT, "Enabled" BOOLEAN DEFAULT 1);
CREATE TABLE "CodeChunks" ("Name" VARCHAR(40) NOT NULL COLLATE NOCASE CHECK (length("Name") <= 40),
  "Text" TEXT);
CREATE TABLE "ProjIds" ("ProjId" INTEGER PRIMARY KEY AUTOINCREMENT CHECK ("ProjId" <= 2147483647));
COMMIT;)";

// What the user reads when the database cannot be used.
constexpr char16_t kOpenFailed[] =
    u"Não foi possível abrir o banco de dados do Quimbel, %1: %2\n\nAs macros de teclado, as memórias de "
    u"cópia, os modelos de código e os identificadores de projeto ficam indisponíveis nesta sessão.";
constexpr char16_t kNotADatabase[] =
    u"o arquivo não é um banco de dados do Quimbel, ou foi cifrado com outra senha";
constexpr char16_t kDamaged[] = u"o arquivo está danificado ou incompleto";
constexpr char16_t kNoAccess[] = u"sem permissão para ler e gravar o arquivo ou a sua pasta";
constexpr char16_t kNotQuimbel[] = u"o arquivo não tem as tabelas do Quimbel";
constexpr char16_t kCannotCreate[] = u"não foi possível criar o arquivo";
constexpr char16_t kNoEncryption[] =
    u"a cifragem do SQLCipher não está ativa (o programa foi ligado a outra biblioteca SQLite)";
constexpr char16_t kNotOpen[] = u"o banco de dados não está aberto";
constexpr char16_t kUnknownCipher[] =
    u"a versão %1 do SQLCipher não é suportada (é preciso a 3 ou mais nova)";
constexpr char16_t kCipherSettingIgnored[] =
    u"o SQLCipher %1 não aceitou a configuração \"%2\" (ficou \"%3\"), sem a qual o arquivo não teria o "
    u"formato do Quimbel";
constexpr char16_t kNoRow[] = u"nenhuma linha de \"%1\" tem %2 = '%3'";
constexpr char16_t kInvalidText[] =
    u"o texto tem caracteres que não são Unicode válido (metades de pares substitutos) e não foi gravado";

[[noreturn]] void raiseEngine(sqlite3* db, int rc) {
  throw ide::Error(rc, QString::fromUtf8(db ? sqlite3_errmsg(db) : sqlite3_errstr(rc)));
}

void check(sqlite3* db, int rc) {
  if (rc != SQLITE_OK) raiseEngine(db, rc);
}

void exec(sqlite3* db, const char* sql) {
  check(db, sqlite3_exec(db, sql, nullptr, nullptr, nullptr));
}

/// The first column of the first row of `sql`, empty when there is none.
QString firstValue(sqlite3* db, const char* sql) {
  sqlite3_stmt* statement = nullptr;
  check(db, sqlite3_prepare_v2(db, sql, -1, &statement, nullptr));
  const int rc = sqlite3_step(statement);
  const auto* text = reinterpret_cast<const char*>(sqlite3_column_text(statement, 0));
  QString value = rc == SQLITE_ROW && text ? QString::fromUtf8(text) : QString();
  sqlite3_finalize(statement);
  if (rc != SQLITE_ROW && rc != SQLITE_DONE) raiseEngine(db, rc);
  return value;
}

/// Closes a connection that did not get as far as being kept.
class Connection {
 public:
  explicit Connection(sqlite3* db) : m_db(db) {}
  Connection(Connection&& other) noexcept : m_db(other.release()) {}
  ~Connection() { sqlite3_close_v2(m_db); }
  Connection(const Connection&) = delete;
  Connection& operator=(const Connection&) = delete;
  sqlite3* get() const { return m_db; }
  sqlite3* release() { return std::exchange(m_db, nullptr); }

 private:
  sqlite3* m_db;
};

/// Sets every cipher setting of kCipherSettings that the library has, before the first page is read, and
/// checks that each took: a library that ignored one would read nothing, or write another format.
void pinCipherSettings(sqlite3* db, const QString& version) {
  const int major = version.section(u'.', 0, 0).toInt();
  if (major < 3) throw ide::Error(SQLITE_MISUSE, QString::fromUtf16(kUnknownCipher).arg(version));
  for (const CipherSetting& setting : kCipherSettings) {
    if (major < setting.fromMajor || major > setting.untilMajor) continue;
    const QByteArray set = QByteArray("PRAGMA ") + setting.pragma + " = " + setting.value;
    exec(db, set.constData());
    const QString value = firstValue(db, (QByteArray("PRAGMA ") + setting.pragma).constData());
    if (value != QLatin1StringView(setting.readBack))
      throw ide::Error(
          SQLITE_MISUSE,
          QString::fromUtf16(kCipherSettingIgnored).arg(version, QString::fromLatin1(set), value));
  }
}

/// An existing file, opened read-write (never created) with the key set. The key itself is checked only
/// by the first read.
Connection openKeyed(const QString& path) {
  sqlite3* raw = nullptr;
  const int rc = sqlite3_open_v2(QFile::encodeName(path).constData(), &raw, SQLITE_OPEN_READWRITE, nullptr);
  Connection db(raw);
  check(db.get(), rc);
  sqlite3_extended_result_codes(db.get(), 1);
  check(db.get(), sqlite3_key(db.get(), kPassword, static_cast<int>(sizeof kPassword - 1)));
  // Linked against plain SQLite the key would be ignored and the file written in clear.
  const QString version = firstValue(db.get(), "PRAGMA cipher_version");
  if (version.isEmpty()) throw ide::Error(SQLITE_MISUSE, QString::fromUtf16(kNoEncryption));
  pinCipherSettings(db.get(), version);
  sqlite3_busy_timeout(db.get(), kBusyTimeoutMs);
  return db;
}

/// Read and write for the owner, read for everyone; write for the group and for others as the directory
/// grants them, so that a database in a folder all users may write is one they may all change.
mode_t sharedMode(const QString& directory) {
  mode_t mode = S_IRUSR | S_IWUSR | S_IRGRP | S_IROTH;
  struct stat info {};
  if (::stat(QFile::encodeName(directory).constData(), &info) == 0)
    mode |= info.st_mode & (S_IWGRP | S_IWOTH);
  return mode;
}

/// Moves `from` to `to` unless `to` exists; false when it does.
bool renameNoReplace(const QByteArray& from, const QByteArray& to) {
  if (::renameat2(AT_FDCWD, from.constData(), AT_FDCWD, to.constData(), RENAME_NOREPLACE) == 0) return true;
  if (errno == EINVAL || errno == ENOSYS) {  // a file system without it: a hard link is as safe
    if (::link(from.constData(), to.constData()) == 0) {
      ::unlink(from.constData());
      return true;
    }
  }
  if (errno == EEXIST) return false;
  throw ide::Error(ide::err::PathFileAccessError, QString::fromLocal8Bit(std::strerror(errno)));
}

void syncDirectory(const QString& directory) {
  const int fd = ::open(QFile::encodeName(directory).constData(), O_RDONLY | O_DIRECTORY);
  if (fd < 0) return;
  ::fsync(fd);
  ::close(fd);
}

/// What the user is told about a failure of OpenFile.
QString openFailureReason(const std::exception& failure) {
  const auto* error = dynamic_cast<const ide::Error*>(&failure);
  const QString detail = error ? error->description() : QString::fromLocal8Bit(failure.what());
  const char16_t* reason = nullptr;
  switch (error ? error->number() & 0xff : 0) {
    case SQLITE_NOTADB:
      reason = kNotADatabase;
      break;
    case SQLITE_CORRUPT:
      reason = kDamaged;
      break;
    case SQLITE_CANTOPEN:
    case SQLITE_PERM:
    case SQLITE_READONLY:
    case SQLITE_AUTH:
      reason = kNoAccess;
      break;
    default:
      return detail;
  }
  return QStringLiteral("%1 (%2)").arg(QString::fromUtf16(reason), detail);
}

QString unavailableMessage(const QString& file, QString reason) {
  if (!reason.endsWith(u'.')) reason += u'.';
  return QString::fromUtf16(kOpenFailed).arg(file, reason);
}

QString describe(const std::exception& failure) {
  const auto* error = dynamic_cast<const ide::Error*>(&failure);
  return error ? error->description() : QString::fromLocal8Bit(failure.what());
}

long numberOf(const std::exception& failure) {
  const auto* error = dynamic_cast<const ide::Error*>(&failure);
  return error ? error->number() : ide::err::InvalidProcedureCall;
}

/// Runs an operation whose failures reach the caller as the application data error: the engine's number
/// goes to the last-error record, the description (naming the file) and the place to the caller.
template <class Work>
auto appDataOperation(const QString& file, const char* procedure, int line, Work&& work) -> decltype(work()) {
  try {
    return work();
  } catch (const std::exception& failure) {
    common::recordErrorNumber(failure);
    throw common::LocatedError(kAppDataError, file + QStringLiteral(": ") + describe(failure),
                               {QStringLiteral("CAppInfoFile"), QString::fromLatin1(procedure), line});
  }
}

/// Runs an operation whose failures reach the caller with the engine's own number.
template <class Work>
auto engineOperation(const QString& file, Work&& work) -> decltype(work()) {
  try {
    return work();
  } catch (const std::exception& failure) {
    throw ide::Error(numberOf(failure), file + QStringLiteral(": ") + describe(failure));
  }
}

// ---------------------------------------------------------------------------------------------------

/// A statement prepared once and used for the life of the connection.
class Statement {
 public:
  Statement(sqlite3* db, const QString& sql) : m_db(db) {
    check(db, sqlite3_prepare_v2(db, sql.toUtf8().constData(), -1, &m_statement, nullptr));
  }
  ~Statement() { sqlite3_finalize(m_statement); }
  Statement(const Statement&) = delete;
  Statement& operator=(const Statement&) = delete;

  /// Starts a use: the bindings and the position of the last use are cleared.
  Statement& start() {
    sqlite3_reset(m_statement);
    sqlite3_clear_bindings(m_statement);
    return *this;
  }
  Statement& bind(int index, const QString& text) {
    if (!QStringView(text).isValidUtf16())
      throw ide::Error(ide::err::InvalidProcedureCall, QString::fromUtf16(kInvalidText));
    const QByteArray utf8 = text.toUtf8();
    check(m_db, sqlite3_bind_text64(m_statement, index, utf8.constData(),
                                    static_cast<sqlite3_uint64>(utf8.size()), SQLITE_TRANSIENT, SQLITE_UTF8));
    return *this;
  }
  Statement& bind(int index, qint64 value) {
    check(m_db, sqlite3_bind_int64(m_statement, index, value));
    return *this;
  }
  /// True while there is a row; the statement is reset once done.
  bool step() {
    const int rc = sqlite3_step(m_statement);
    if (rc == SQLITE_ROW) return true;
    sqlite3_reset(m_statement);
    if (rc != SQLITE_DONE) raiseEngine(m_db, rc);
    return false;
  }
  void run() {
    step();
    sqlite3_reset(m_statement);
  }
  qint64 integer(int column) const { return sqlite3_column_int64(m_statement, column); }
  /// Embedded NULs included; NULL reads as empty.
  QString text(int column) const {
    const auto* data = reinterpret_cast<const char*>(sqlite3_column_text(m_statement, column));
    return data ? QString::fromUtf8(data, sqlite3_column_bytes(m_statement, column)) : QString();
  }

 private:
  sqlite3* m_db;
  sqlite3_stmt* m_statement = nullptr;
};

/// The statements over one keyed table: find the first row with a key, add one, change its text or state.
struct KeyedStatements {
  KeyedStatements(sqlite3* db, const QString& table, const QString& key, bool withState)
      : table(table),
        key(key),
        withState(withState),
        find(db,
             QStringLiteral(
                 R"(SELECT rowid, "Text"%3 FROM "%1" WHERE "%2" = ?1 COLLATE NOCASE ORDER BY rowid LIMIT 1)")
                 .arg(table, key, withState ? QStringLiteral(R"(, "Enabled")") : QString())),
        insert(db,
               withState
                   ? QStringLiteral(R"(INSERT INTO "%1" ("%2", "Text", "Enabled") VALUES (?1, ?2, ?3))")
                         .arg(table, key)
                   : QStringLiteral(R"(INSERT INTO "%1" ("%2", "Text") VALUES (?1, ?2))").arg(table, key)),
        setText(db, QStringLiteral(R"(UPDATE "%1" SET "Text" = ?2 WHERE rowid = ?1)").arg(table)) {
    if (withState)
      setState.emplace(db, QStringLiteral(R"(UPDATE "%1" SET "Enabled" = ?2 WHERE rowid = ?1)").arg(table));
  }

  QString table;
  QString key;
  bool withState;
  Statement find;
  Statement insert;
  Statement setText;
  std::optional<Statement> setState;
};

}  // namespace

struct CAppInfoFile::KeyedRow {
  qint64 rowId = 0;
  QString text;
  bool enabled = true;
};

struct CAppInfoFile::Statements {
  explicit Statements(sqlite3* db)
      : db(db),
        begin(db, QStringLiteral("BEGIN IMMEDIATE")),
        commit(db, QStringLiteral("COMMIT")),
        macros(db, QStringLiteral("Macros"), QStringLiteral("MacroId"), true),
        copyBuffers(db, QStringLiteral("CopyBuffers"), QStringLiteral("CopyBufferId"), true),
        codeChunks(db, QStringLiteral("CodeChunks"), QStringLiteral("Name"), false),
        newProjId(db, QStringLiteral(R"(INSERT INTO "ProjIds" DEFAULT VALUES)")) {}

  /// Runs `work` in a write transaction: taken at once (so that two processes never both read and then
  /// both write), committed durably, and rolled back when anything fails.
  template <class Work>
  void transaction(Work&& work) {
    begin.start().run();
    try {
      work();
      commit.start().run();
    } catch (...) {
      if (!sqlite3_get_autocommit(db)) sqlite3_exec(db, "ROLLBACK", nullptr, nullptr, nullptr);
      throw;
    }
  }

  std::optional<KeyedRow> find(KeyedStatements& table, const QString& id) {
    Statement& find = table.find.start().bind(1, id);
    if (!find.step()) return std::nullopt;
    KeyedRow row{find.integer(0), find.text(1), table.withState && find.integer(2) != 0};
    find.start();
    return row;
  }

  sqlite3* db;
  Statement begin;
  Statement commit;
  KeyedStatements macros;
  KeyedStatements copyBuffers;
  KeyedStatements codeChunks;
  Statement newProjId;
};

CAppInfoFile::CAppInfoFile() = default;

CAppInfoFile::~CAppInfoFile() {
  CloseFileInfo();
}

void CAppInfoFile::OpenFile(const QString& installationPath) {
  CloseFileInfo();
  m_unavailable.clear();
  QString directory = installationPath.trimmed();
  if (directory.isEmpty()) {
    m_filePath.clear();
    m_unavailable =
        unavailableMessage(QString::fromLatin1(kFileName), QString::fromLatin1(kNoInstallationPath));
    throw ide::Error(kAppDataError, QString::fromLatin1(kNoInstallationPath),
                     QString::fromLatin1(kInitializeSource));
  }
  if (directory.endsWith(u'/')) directory.chop(1);
  m_filePath = directory + u'/' + QLatin1StringView(kFileName);

  try {
    if (!QFileInfo::exists(m_filePath)) CreateFileInfo(m_filePath);
    Connection db = openKeyed(m_filePath);
    exec(db.get(), "SELECT count(*) FROM sqlite_master");
    if (sqlite3_db_readonly(db.get(), "main") == 1)
      throw ide::Error(SQLITE_READONLY, QString::fromUtf8(sqlite3_errstr(SQLITE_READONLY)));
    // Every page is read once, so that a damaged or cut-short file is found now rather than by a later
    // write; on a file of a few dozen pages this costs far less than a millisecond.
    if (const QString verdict = firstValue(db.get(), "PRAGMA quick_check");
        verdict != QLatin1StringView("ok"))
      throw ide::Error(SQLITE_CORRUPT, verdict);
    try {
      m_statements = std::make_unique<Statements>(db.get());
    } catch (const ide::Error& missing) {
      throw ide::Error(missing.number(),
                       QStringLiteral("%1 (%2)").arg(QString::fromUtf16(kNotQuimbel), missing.description()));
    }
    // Only a file known to be ours is changed: write-ahead logging lets readers go on while another
    // process writes and commits with one flush. The log and its index stay beside the file (emptied),
    // since in a shared folder with the sticky bit only their creator could delete them.
    exec(db.get(), "PRAGMA synchronous = FULL");
    exec(db.get(), "PRAGMA journal_size_limit = 0");
    firstValue(db.get(), "PRAGMA journal_mode = WAL");
    int persist = 1;
    sqlite3_file_control(db.get(), "main", SQLITE_FCNTL_PERSIST_WAL, &persist);
    m_db = db.release();
  } catch (const std::exception& failure) {
    m_statements.reset();
    m_unavailable = unavailableMessage(m_filePath, openFailureReason(failure));
    common::recordErrorNumber(failure);
    throw ide::Error(kAppDataError, QString::fromLatin1(kInitializationError),
                     QString::fromLatin1(kInitializeSource));
  }
}

void CAppInfoFile::CloseFileInfo() {
  m_statements.reset();
  if (m_db) sqlite3_close_v2(std::exchange(m_db, nullptr));
}

void CAppInfoFile::CreateFileInfo(const QString& FilePath) {
  const QFileInfo target(FilePath);
  const QString directory = target.absolutePath();
  QTemporaryFile temp(directory + QStringLiteral("/.") + target.fileName() + QStringLiteral(".XXXXXX"));
  if (!temp.open())
    throw ide::Error(ide::err::PathFileAccessError,
                     QStringLiteral("%1 (%2)").arg(QString::fromUtf16(kCannotCreate), temp.errorString()));
  temp.close();
  {
    Connection db = openKeyed(temp.fileName());
    firstValue(db.get(), "PRAGMA journal_mode = WAL");
    exec(db.get(), kSchema);
  }
  ::chmod(QFile::encodeName(temp.fileName()).constData(), sharedMode(directory));
  // Never over a file that another process created meanwhile: that one is kept and ours goes.
  if (!renameNoReplace(QFile::encodeName(temp.fileName()), QFile::encodeName(FilePath))) return;
  temp.setAutoRemove(false);
  syncDirectory(directory);
}

sqlite3* CAppInfoFile::database() const {
  if (!m_db) throw ide::Error(kAppDataError, QString::fromUtf16(kNotOpen));
  return m_db;
}

// ---------------------------------------------------------------------------------------------------
// Macros and copy buffers

CAppInfoFile::KeyedRow CAppInfoFile::readKeyed(Table table, const QString& id) {
  database();
  KeyedStatements& rows = table == Table::Macros ? m_statements->macros : m_statements->copyBuffers;
  if (auto row = m_statements->find(rows, id)) return *row;
  // The first read of an id adds its row. Looked for again inside the transaction, so that two processes
  // reading the same new id add one row between them.
  KeyedRow row;
  m_statements->transaction([&] {
    if (auto existing = m_statements->find(rows, id)) {
      row = *existing;
      return;
    }
    rows.insert.start().bind(1, id).bind(2, QString()).bind(3, qint64{1}).run();
  });
  return row;
}

void CAppInfoFile::writeState(Table table, const QString& id, bool state) {
  database();
  KeyedStatements& rows = table == Table::Macros ? m_statements->macros : m_statements->copyBuffers;
  m_statements->transaction([&] {
    const auto row = m_statements->find(rows, id);
    if (!row) throw ide::Error(kAppDataError, QString::fromUtf16(kNoRow).arg(rows.table, rows.key, id));
    rows.setState->start().bind(1, row->rowId).bind(2, qint64{state ? 1 : 0}).run();
  });
}

void CAppInfoFile::writeText(Table table, const QString& id, const QString& text) {
  database();
  KeyedStatements& rows = table == Table::Macros ? m_statements->macros : m_statements->copyBuffers;
  m_statements->transaction([&] {
    if (const auto row = m_statements->find(rows, id))
      rows.setText.start().bind(1, row->rowId).bind(2, text).run();
    else
      rows.insert.start().bind(1, id).bind(2, text).bind(3, qint64{1}).run();
  });
}

bool CAppInfoFile::GetMacroState(const QString& MacroId) {
  return appDataOperation(m_filePath, "GetMacroState", __LINE__,
                          [&] { return readKeyed(Table::Macros, MacroId).enabled; });
}

bool CAppInfoFile::GetCopyBufferState(const QString& CopyBufferId) {
  return appDataOperation(m_filePath, "GetCopyBufferState", __LINE__,
                          [&] { return readKeyed(Table::CopyBuffers, CopyBufferId).enabled; });
}

QString CAppInfoFile::GetMacroText(const QString& MacroId) {
  return appDataOperation(m_filePath, "GetMacroText", __LINE__,
                          [&] { return readKeyed(Table::Macros, MacroId).text; });
}

QString CAppInfoFile::GetCopyBufferText(const QString& CopyBufferId) {
  return appDataOperation(m_filePath, "GetCopyBufferText", __LINE__,
                          [&] { return readKeyed(Table::CopyBuffers, CopyBufferId).text; });
}

void CAppInfoFile::WriteMacroState(const QString& MacroId, bool State) {
  appDataOperation(m_filePath, "WriteMacroState", __LINE__,
                   [&] { writeState(Table::Macros, MacroId, State); });
}

void CAppInfoFile::WriteCopyBufferState(const QString& CopyBufferId, bool State) {
  appDataOperation(m_filePath, "WriteCopyBufferState", __LINE__,
                   [&] { writeState(Table::CopyBuffers, CopyBufferId, State); });
}

void CAppInfoFile::WriteMacroText(const QString& MacroId, const QString& Text) {
  appDataOperation(m_filePath, "WriteMacroText", __LINE__, [&] { writeText(Table::Macros, MacroId, Text); });
}

void CAppInfoFile::WriteCopyBufferText(const QString& CopyBufferId, const QString& Text) {
  appDataOperation(m_filePath, "WriteCopyBufferText", __LINE__,
                   [&] { writeText(Table::CopyBuffers, CopyBufferId, Text); });
}

// ---------------------------------------------------------------------------------------------------
// Templates

void CAppInfoFile::writeTemplate(const char* name, const QString& text) {
  database();
  KeyedStatements& rows = m_statements->codeChunks;
  const QString key = QString::fromLatin1(name);
  m_statements->transaction([&] {
    if (const auto row = m_statements->find(rows, key))
      rows.setText.start().bind(1, row->rowId).bind(2, text).run();
    else
      rows.insert.start().bind(1, key).bind(2, text).run();
  });
}

QString CAppInfoFile::readTemplate(const char* name, QString (*stockText)()) {
  return engineOperation(m_filePath, [&] {
    database();
    const auto row = m_statements->find(m_statements->codeChunks, QString::fromLatin1(name));
    return row ? row->text : stockText();
  });
}

void CAppInfoFile::WriteDefErrorHandler(const QString& Text) {
  appDataOperation(m_filePath, "WriteDefErrorHandler", __LINE__,
                   [&] { writeTemplate("DefaultErrorHandler", Text); });
}

void CAppInfoFile::WriteProcDocHeader(const QString& Text) {
  appDataOperation(m_filePath, "WriteProcDocHeader", __LINE__, [&] { writeTemplate("ProcDocHeader", Text); });
}

void CAppInfoFile::WriteModuleDocHeader(const QString& Text) {
  appDataOperation(m_filePath, "WriteModuleDocHeader", __LINE__,
                   [&] { writeTemplate("ModuleDocHeader", Text); });
}

QString CAppInfoFile::GetDefErrorHandler() {
  return readTemplate("DefaultErrorHandler", &DefaultErrorHandler);
}

QString CAppInfoFile::GetProcDocHeader() {
  return readTemplate("ProcDocHeader", &DefaultProcDocHeader);
}

QString CAppInfoFile::GetModuleDocHeader() {
  return readTemplate("ModuleDocHeader", &DefaultModuleDocHeader);
}

QString CAppInfoFile::DefaultErrorHandler() {
  return QStringLiteral(
      "\tDim errnum as Long\n"
      "\terrnum = Err.Number\n"
      "\tErr.Clear\n"
      "\t' Abaixo, use a numeração de linhas do Quimbel para\n"
      "\t' tirar proveito do valor retornado  por  Erl. Sem \n"
      "\t' numerar as linhas, 0 será retornado.\n"
      "\tMsgBox errnum & \" \" & Error$(errnum) & vbLf & _\n"
      "\t\t\"Erro em \" & \"{ModuleName}_{ProcedureName}, Linha: \" & Erl");
}

QString CAppInfoFile::DefaultProcDocHeader() {
  const QString rule = QStringLiteral("' ") + QString(53, u'*');
  return rule +
         QStringLiteral(
             "\n' Módulo: {ModuleName}  \n' Procedimento: {ProcedureName} \n' Criado por: {UserName} \n"
             "' Em {Date} {Time}\n' Propósito: \n") +
         rule;
}

// ---------------------------------------------------------------------------------------------------

QString CAppInfoFile::GetNextProjId() {
  return engineOperation(m_filePath, [&] {
    database();
    qint64 id = 0;
    m_statements->transaction([&] {
      m_statements->newProjId.start().run();
      id = sqlite3_last_insert_rowid(m_db);
    });
    return QStringLiteral("%1").arg(id, 6, 10, QChar(u'0'));
  });
}

}  // namespace appdata
