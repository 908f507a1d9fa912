// SPDX-License-Identifier: MIT
// Test-side checks of VB6 source files, written independently of the generator: line ends, the code
// page, where a file's header ends, block structure, and the files a .vbp or .vbg names.
#pragma once

#include <QByteArray>
#include <QString>
#include <QStringList>

#include <vector>

namespace vbcheck {

/// "" when every line ends with CRLF (and so does the file, unless it is empty); otherwise where the first
/// lone CR or LF, or the unterminated last line, is.
QString lineEndProblem(const QByteArray& bytes);

/// "" when the bytes are text in Windows-1252: no NUL and none of the five bytes the code page leaves
/// undefined (0x81, 0x8D, 0x8F, 0x90, 0x9D); otherwise the offset and byte.
QString codePageProblem(const QByteArray& bytes);

/// "" unless the bytes hold UTF-8 encoded Latin letters (0xC2 or 0xC3 followed by 0x80-0xBF), the sign of
/// text saved in the wrong encoding; otherwise the offset.
QString utf8Problem(const QByteArray& bytes);

/// The file decoded from Windows-1252 and split at CRLF (no trailing empty line).
QStringList decodeLines(const QByteArray& bytes);

enum class FileKind { Module, Class, Form };

/// The number of header lines before code line 1: `Attribute VB_` lines of a module; VERSION ... END and
/// the attributes of a class; VERSION, Object lines, the Begin ... End description and the attributes of a
/// form. -1 when the header is malformed.
int headerLineCount(const QStringList& lines, FileKind kind);

struct Procedure {
  QString kind;  // "Sub", "Function", "Property Get", "Property Let", "Property Set"
  QString name;
  int headerLine = 0;  // 0-based index into the code lines
  int headerPhysicalLines = 0;
};

struct Structure {
  std::vector<Procedure> procedures;
  int maxBlockDepth = 0;  // deepest nesting of statement blocks inside a procedure
  QStringList problems;   // empty when the code is well formed
};

/// Walks the code lines (after the header) as logical lines: every procedure must end with its own
/// End line, every block (If, Select Case, For, Do, While, With, #If, Type, Enum) must be closed by its
/// own end inside the same procedure, physical lines must fit in 1023 characters and logical lines in
/// 25 physical lines. Hidden `Attribute` lines are skipped.
Structure checkStructure(const QStringList& codeLines);

struct ProjectEntry {
  QString kind;  // "Module", "Class" or "Form"
  QString name;  // from the line for modules and classes; empty for forms
  QString file;  // as written, with backslashes
};

/// The Module=, Class= and Form= entries of a .vbp.
std::vector<ProjectEntry> projectEntries(const QStringList& vbpLines);

/// The value of `key=` in a .vbp or .vbg (the first occurrence), or a null string.
QString keyValue(const QStringList& lines, const QString& key);

/// The name in a file's `Attribute VB_Name = "..."` line, or "".
QString vbName(const QStringList& lines);

/// `relative` (backslash-separated, relative to `baseDir`) as a clean absolute path.
QString resolve(const QString& baseDir, const QString& relative);

}  // namespace vbcheck
