// SPDX-License-Identifier: MIT
// A VB6 source file as lines of text, each with the line end it had on disk, so that a file is written
// back with exactly the bytes it was read from.
#pragma once

#include <QByteArray>
#include <QByteArrayView>
#include <QString>

#include <cstddef>
#include <vector>

namespace host {

/// The IDE refuses physical lines longer than this.
inline constexpr int kMaxLineLength = 1023;

enum class LineEnd : quint8 { CRLF, LF, CR, None };

struct SourceLine {
  QString text;
  LineEnd end = LineEnd::CRLF;
};

/// The characters of a line end.
QByteArrayView lineEndBytes(LineEnd end);

/// Splits ANSI bytes into lines. A file that holds a NUL byte is not text; a line longer than
/// kMaxLineLength characters is refused. Both throw ide::Error (number 321) whose description names
/// `fileName` and the 1-based line, e.g. "Module1.bas, line 12: line longer than 1023 characters".
/// The last line has LineEnd::None when the file does not end with a line end; an empty file gives no lines.
/// `firstLine` is the 0-based line of the file that `bytes` start at, for the messages.
std::vector<SourceLine> readSourceLines(QByteArrayView bytes, const QString& fileName, int firstLine = 0);

/// Refuses what readSourceLines refuses, without making the lines: `bytes` start at line `firstLine`
/// (0-based) of the file, for the messages.
void checkSourceLines(QByteArrayView bytes, const QString& fileName, int firstLine = 0);

/// The lines of readSourceLines, each read when first asked for: a reader of a file's head makes no
/// more of them than it looks at.
class SourceLineReader {
 public:
  SourceLineReader(QByteArrayView bytes, const QString& fileName) : m_bytes(bytes), m_fileName(fileName) {}
  /// Line `index` (0-based), read up to it; null past the file's end.
  const SourceLine* at(std::size_t index);
  /// The byte where line `index` starts: a line read, or the one after the last read.
  qsizetype start(std::size_t index) const { return index < m_starts.size() ? m_starts[index] : m_position; }

 private:
  QByteArrayView m_bytes;
  const QString& m_fileName;
  qsizetype m_position = 0;
  std::vector<SourceLine> m_lines;
  std::vector<qsizetype> m_starts;
};

/// Joins lines back into ANSI bytes. Throws ide::Error (number 321) naming `fileName` and the line when a
/// character cannot be written in the code page.
QByteArray writeSourceLines(const std::vector<SourceLine>& lines, const QString& fileName);

/// Appends one line (text and end) to `out`; throws as writeSourceLines. `previous` is the line end written
/// before it (None for a first line); returns the line end written, which is the line's own except where
/// edits put together what no file can hold (see lineEndToWrite).
LineEnd appendSourceLine(QByteArray& out, const SourceLine& line, const QString& fileName, int lineNumber,
                         LineEnd previous = LineEnd::None);

/// The line end to write after `line` when the line before it ended with `previous` (None for a first
/// line), so that the bytes read back give the same lines. Edits can make two sequences that no file read
/// from disk holds: an empty line ending in LF after a lone CR (the two would read back as one CRLF), and
/// an empty last line without a line end (it would read back as no line at all). Such an empty line ends
/// like the line before it.
LineEnd lineEndToWrite(const SourceLine& line, LineEnd previous);

/// The line end to give a new line at `position`: the one of the line before it, else of the line after
/// it, else CRLF.
LineEnd lineEndAt(const std::vector<SourceLine>& lines, std::size_t position);

/// Inserts `text` as a new line before `position`, ending like its neighbours. Appended after a last line
/// that has no line end, the new line becomes the one without an end and the old last line gets one, so
/// that the two stay separate lines.
void insertSourceLine(std::vector<SourceLine>& lines, std::size_t position, QString text);

}  // namespace host
