// SPDX-License-Identifier: MIT
// The application database: what belongs to the add-in as a whole rather than to one project (the
// keyboard macros' texts and states, the copy buffers' texts and states, the new-procedure templates and
// the counter of project identifiers), in one encrypted SQLite file, Quimbel.inf, in the installation
// directory. Every IDE process on the machine may hold the file open at once: SQLite's own file locks
// arbitrate (writers wait up to kBusyTimeoutMs for each other) and every change is committed durably
// before an operation returns.
//
// The file is SQLCipher-encrypted with a fixed password (kPassword) and cipher settings pinned whatever the
// SQLCipher version (3.x and 4.x have different defaults): AES-256-CBC, 1,024-byte pages, PBKDF2-HMAC-SHA1
// with 4,000 rounds, HMAC-SHA1 per page, no plain-text header. To look inside it:
//   sqlcipher Quimbel.inf
//   PRAGMA key = '$468$468$468'; PRAGMA kdf_iter = 4000;                      (SQLCipher 3)
//   ... and PRAGMA cipher_compatibility = 3; PRAGMA kdf_iter = 4000;          (SQLCipher 4)
//
// Tables (no indexes; a row is found by its key, the first in insertion order when there are several):
//   Macros       (MacroId VARCHAR(20), Text TEXT, Enabled BOOLEAN)
//   CopyBuffers  (CopyBufferId VARCHAR(20), Text TEXT, Enabled BOOLEAN DEFAULT 1)
//   CodeChunks   (Name VARCHAR(40) NOT NULL, Text TEXT)
//   ProjIds      (ProjId INTEGER PRIMARY KEY AUTOINCREMENT)
// Keys compare without regard to letter case.
#pragma once

#include <QString>

#include <memory>

struct sqlite3;
struct sqlite3_stmt;

namespace appdata {

/// The number of every failure of the application database that reaches a caller as its own.
inline constexpr long kAppDataError = 9998;
/// Where OpenFile's failures come from.
inline constexpr char kInitializeSource[] = "CAppInfoFile.Initialize";
inline constexpr char kNoInstallationPath[] = "No installation path information.";
inline constexpr char kInitializationError[] = "Initialization error.";

inline constexpr char kFileName[] = "Quimbel.inf";
inline constexpr char kPassword[] = "$468$468$468";
/// How long one operation waits for another process's write to end before it fails.
inline constexpr int kBusyTimeoutMs = 5000;

class CAppInfoFile {
 public:
  CAppInfoFile();
  /// Closes the database (CloseFileInfo).
  ~CAppInfoFile();
  CAppInfoFile(const CAppInfoFile&) = delete;
  CAppInfoFile& operator=(const CAppInfoFile&) = delete;

  /// Opens Quimbel.inf in `installationPath` (trimmed; one trailing "/" is dropped), creating it when no
  /// file is there. Callers read the path afresh from the machine configuration for each call. Raises
  /// error kAppDataError from kInitializeSource, described as kNoInstallationPath or kInitializationError;
  /// UnavailableMessage() then says why, naming the file. A file that exists is never replaced, and one
  /// that cannot be used is left exactly as it was.
  void OpenFile(const QString& installationPath);
  bool IsOpen() const { return m_db != nullptr; }
  /// The database file, once OpenFile has formed it.
  const QString& FilePath() const { return m_filePath; }
  /// Why the last OpenFile failed, for the user (names the file and what the features cannot do); empty
  /// when it did not fail.
  const QString& UnavailableMessage() const { return m_unavailable; }

  // Macros and copy buffers. A getter for an id that has no row adds one (enabled, empty text) and returns
  // what it stored. Every failure is raised as kAppDataError, described by the engine and naming the file;
  // the last-error record keeps the engine's own number. A failed write leaves the row as it was.
  bool GetMacroState(const QString& MacroId);
  bool GetCopyBufferState(const QString& CopyBufferId);
  QString GetMacroText(const QString& MacroId);
  /// Raises kAppDataError (and adds nothing) when no row has the id.
  void WriteMacroState(const QString& MacroId, bool State);
  void WriteCopyBufferState(const QString& CopyBufferId, bool State);
  /// Adds the row (enabled) when there is none. Texts of any length and any characters come back
  /// unchanged; a text that is not valid UTF-16 (a lone surrogate) is refused.
  void WriteMacroText(const QString& MacroId, const QString& Text);
  QString GetCopyBufferText(const QString& CopyBufferId);
  void WriteCopyBufferText(const QString& CopyBufferId, const QString& Text);

  // The new-procedure wizard's templates. The writers raise kAppDataError as above; the getters return
  // the stock text while the template has no row (they never write it) and raise the engine's error.
  void WriteDefErrorHandler(const QString& Text);
  void WriteProcDocHeader(const QString& Text);
  void WriteModuleDocHeader(const QString& Text);
  QString GetDefErrorHandler();
  QString GetProcDocHeader();
  QString GetModuleDocHeader();

  /// Releases the prepared statements and the database; harmless when not open.
  void CloseFileInfo();
  /// Creates an empty database with the four tables at `FilePath`: built under a temporary name beside
  /// it and moved into place only if no file has appeared there meanwhile (which is then kept). The new
  /// file is as writable for the group and for others as its directory is.
  static void CreateFileInfo(const QString& FilePath);
  /// A new project identifier: at least six digits, zero-padded ("000001"); never handed out twice, by
  /// this process or any other. Raises the engine's error.
  QString GetNextProjId();

  /// The stock templates (lines joined by "\n").
  static QString DefaultErrorHandler();
  static QString DefaultProcDocHeader();
  static QString DefaultModuleDocHeader() { return {}; }

 private:
  struct Statements;
  struct KeyedRow;
  enum class Table { Macros, CopyBuffers };

  KeyedRow readKeyed(Table table, const QString& id);
  void writeState(Table table, const QString& id, bool state);
  void writeText(Table table, const QString& id, const QString& text);
  void writeTemplate(const char* name, const QString& text);
  QString readTemplate(const char* name, QString (*stockText)());
  sqlite3* database() const;

  QString m_filePath;
  QString m_unavailable;
  sqlite3* m_db = nullptr;
  std::unique_ptr<Statements> m_statements;
};

}  // namespace appdata
