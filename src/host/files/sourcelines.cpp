// SPDX-License-Identifier: MIT
// Line splitting: each line's end is found, a NUL that marks a binary file refused, and the length limit
// the IDE enforces kept.
#include "host/files/sourcelines.h"

#include "host/files/ansi.h"
#include "ide/error.h"

#include <algorithm>
#include <cstring>

namespace host {
namespace {

[[noreturn]] void throwLineError(const QString& fileName, int lineNumber, const QString& problem) {
  throw ide::Error(ide::err::InvalidFileFormat,
                   QStringLiteral("%1, line %2: %3").arg(fileName).arg(lineNumber).arg(problem));
}

}  // namespace

QByteArrayView lineEndBytes(LineEnd end) {
  switch (end) {
    case LineEnd::CRLF:
      return QByteArrayView("\r\n", 2);
    case LineEnd::LF:
      return QByteArrayView("\n", 1);
    case LineEnd::CR:
      return QByteArrayView("\r", 1);
    case LineEnd::None:
      break;
  }
  return {};
}

namespace {

/// The line that starts at `position`: its length and line end; `position` moves to the next line.
/// Refuses a NUL byte and an overlong line, naming `lineNumber` (1-based).
struct LineSpan {
  qsizetype start = 0;
  qsizetype length = 0;
  LineEnd end = LineEnd::None;
};

LineSpan nextLine(QByteArrayView bytes, qsizetype& position, const QString& fileName, int lineNumber) {
  const char* data = bytes.data();
  const qsizetype size = bytes.size();
  LineSpan line{position};
  // memchr finds the line feed many bytes at a time, within the longest line allowed (so that a file of
  // lone CRs is not searched to its end for every line); the line's own bytes are then searched for what
  // ends it sooner (a lone CR) or makes the file binary (NUL).
  const qsizetype window = std::min<qsizetype>(size - position, kMaxLineLength + 1);
  const auto* feed = static_cast<const char*>(std::memchr(data + position, '\n', size_t(window)));
  qsizetype end = feed ? feed - data : position + window;
  if (const auto* cr = static_cast<const char*>(std::memchr(data + position, '\r', size_t(end - position))))
    end = cr - data;
  if (std::memchr(data + position, '\0', size_t(end - position)))
    throwLineError(fileName, lineNumber, QStringLiteral("not a text file"));
  if (end - line.start > kMaxLineLength) {
    // A NUL further on says more than the length does.
    for (; end < size && data[end] != '\n' && data[end] != '\r'; ++end)
      if (data[end] == '\0') throwLineError(fileName, lineNumber, QStringLiteral("not a text file"));
    throwLineError(fileName, lineNumber,
                   QStringLiteral("line longer than %1 characters").arg(kMaxLineLength));
  }
  line.length = end - line.start;
  position = end;
  if (position < size) {
    if (data[position] == '\n') {
      line.end = LineEnd::LF;
      position += 1;
    } else if (position + 1 < size && data[position + 1] == '\n') {
      line.end = LineEnd::CRLF;
      position += 2;
    } else {
      line.end = LineEnd::CR;
      position += 1;
    }
  }
  return line;
}

}  // namespace

std::vector<SourceLine> readSourceLines(QByteArrayView bytes, const QString& fileName, int firstLine) {
  // Counted first (memchr is far quicker than growing the vector): one allocation for every line.
  size_t feeds = 0;
  for (const char *at = bytes.data(), *end = at + bytes.size();
       (at = static_cast<const char*>(std::memchr(at, '\n', size_t(end - at)))); ++at)
    ++feeds;
  std::vector<SourceLine> lines;
  lines.reserve(feeds + 1);
  qsizetype position = 0;
  while (position < bytes.size()) {
    const LineSpan span = nextLine(bytes, position, fileName, firstLine + static_cast<int>(lines.size()) + 1);
    lines.push_back({decodeAnsi(bytes.sliced(span.start, span.length)), span.end});
  }
  return lines;
}

void checkSourceLines(QByteArrayView bytes, const QString& fileName, int firstLine) {
  qsizetype position = 0;
  for (int line = firstLine + 1; position < bytes.size(); ++line)
    nextLine(bytes, position, fileName, line);
}

const SourceLine* SourceLineReader::at(std::size_t index) {
  while (m_lines.size() <= index && m_position < m_bytes.size()) {
    const LineSpan span = nextLine(m_bytes, m_position, m_fileName, static_cast<int>(m_lines.size()) + 1);
    m_lines.push_back({decodeAnsi(m_bytes.sliced(span.start, span.length)), span.end});
    m_starts.push_back(span.start);
  }
  return index < m_lines.size() ? &m_lines[index] : nullptr;
}

LineEnd lineEndToWrite(const SourceLine& line, LineEnd previous) {
  if (!line.text.isEmpty() || previous == LineEnd::None) return line.end;
  if (line.end == LineEnd::None || (line.end == LineEnd::LF && previous == LineEnd::CR)) return previous;
  return line.end;
}

LineEnd appendSourceLine(QByteArray& out, const SourceLine& line, const QString& fileName, int lineNumber,
                         LineEnd previous) {
  qsizetype bad = 0;
  if (!appendAnsi(out, line.text, &bad)) {
    const QString code = QString::number(line.text.at(bad).unicode(), 16).toUpper().rightJustified(4, u'0');
    throwLineError(fileName, lineNumber,
                   QStringLiteral("the character U+%1 in column %2 has no code in the ANSI code page")
                       .arg(code)
                       .arg(bad + 1));
  }
  const LineEnd end = lineEndToWrite(line, previous);
  out.append(lineEndBytes(end));
  return end;
}

LineEnd lineEndAt(const std::vector<SourceLine>& lines, std::size_t position) {
  for (std::size_t i = std::min(position, lines.size()); i > 0; --i) {
    if (lines[i - 1].end != LineEnd::None) return lines[i - 1].end;
  }
  for (std::size_t i = position; i < lines.size(); ++i) {
    if (lines[i].end != LineEnd::None) return lines[i].end;
  }
  return LineEnd::CRLF;
}

void insertSourceLine(std::vector<SourceLine>& lines, std::size_t position, QString text) {
  position = std::min(position, lines.size());
  SourceLine line{std::move(text), lineEndAt(lines, position)};
  if (position == lines.size() && position > 0 && lines[position - 1].end == LineEnd::None) {
    lines[position - 1].end = line.end;
    line.end = LineEnd::None;
  }
  lines.insert(lines.begin() + static_cast<std::ptrdiff_t>(position), std::move(line));
}

QByteArray writeSourceLines(const std::vector<SourceLine>& lines, const QString& fileName) {
  qsizetype total = 0;
  for (const SourceLine& line : lines)
    total += line.text.size() + 2;
  QByteArray out;
  out.reserve(total);
  int lineNumber = 0;
  LineEnd previous = LineEnd::None;
  for (const SourceLine& line : lines)
    previous = appendSourceLine(out, line, fileName, ++lineNumber, previous);
  return out;
}

}  // namespace host
