// SPDX-License-Identifier: MIT
// Test-side checks of VB6 source files; see vbcheck.h.
#include "vbcheck.h"

#include <QDir>
#include <QRegularExpression>
#include <QStringDecoder>

namespace vbcheck {

QString lineEndProblem(const QByteArray& bytes) {
  for (qsizetype i = 0; i < bytes.size(); ++i) {
    if (bytes[i] == '\r') {
      if (i + 1 >= bytes.size() || bytes[i + 1] != '\n') return QString("lone CR at byte %1").arg(i);
      ++i;
    } else if (bytes[i] == '\n') {
      return QString("lone LF at byte %1").arg(i);
    }
  }
  if (!bytes.isEmpty() && !bytes.endsWith("\r\n")) return "last line has no CRLF";
  return {};
}

QString codePageProblem(const QByteArray& bytes) {
  for (qsizetype i = 0; i < bytes.size(); ++i) {
    const auto byte = quint8(bytes[i]);
    if (byte == 0x00 || byte == 0x81 || byte == 0x8D || byte == 0x8F || byte == 0x90 || byte == 0x9D) {
      return QString("byte 0x%1 at %2").arg(byte, 2, 16, QChar('0')).arg(i);
    }
  }
  QStringDecoder decoder("Windows-1252");
  if (!decoder.isValid()) return "no Windows-1252 decoder";
  const QString text = decoder.decode(bytes);
  if (decoder.hasError()) return "decoder reported an error";
  return {};
}

QString utf8Problem(const QByteArray& bytes) {
  for (qsizetype i = 0; i + 1 < bytes.size(); ++i) {
    const auto lead = quint8(bytes[i]);
    const auto next = quint8(bytes[i + 1]);
    if ((lead == 0xC2 || lead == 0xC3) && next >= 0x80 && next <= 0xBF) {
      return QString("UTF-8 sequence at byte %1").arg(i);
    }
  }
  return {};
}

QStringList decodeLines(const QByteArray& bytes) {
  QStringDecoder decoder("Windows-1252");
  QString text = decoder.decode(bytes);
  if (text.endsWith("\r\n")) text.chop(2);
  if (text.isEmpty()) return {};
  return text.split("\r\n");
}

namespace {

int skipAttributes(const QStringList& lines, int from) {
  while (from < lines.size() && lines[from].startsWith("Attribute VB_"))
    ++from;
  return from;
}

}  // namespace

int headerLineCount(const QStringList& lines, FileKind kind) {
  switch (kind) {
    case FileKind::Module:
      return skipAttributes(lines, 0);
    case FileKind::Class: {
      if (lines.size() < 2 || lines[0] != "VERSION 1.0 CLASS" || lines[1] != "BEGIN") return -1;
      const int end = int(lines.indexOf("END"));
      return end < 0 ? -1 : skipAttributes(lines, end + 1);
    }
    case FileKind::Form: {
      if (lines.isEmpty() || lines[0] != "VERSION 5.00") return -1;
      int i = 1;
      while (i < lines.size() && lines[i].startsWith("Object"))
        ++i;
      if (i >= lines.size() || !lines[i].startsWith("Begin VB.")) return -1;
      int depth = 0;
      for (; i < lines.size(); ++i) {
        const QString trimmed = lines[i].trimmed();
        if (trimmed.startsWith("Begin ") || trimmed.startsWith("BeginProperty ")) {
          ++depth;
        } else if (trimmed == "End" || trimmed == "EndProperty") {
          if (--depth == 0) return skipAttributes(lines, i + 1);
        }
      }
      return -1;
    }
  }
  return -1;
}

namespace {

// The statement text of a logical line: string literals emptied, the comment removed.
QString withoutStringsAndComment(const QString& line) {
  QString out;
  out.reserve(line.size());
  bool inString = false;
  for (qsizetype i = 0; i < line.size(); ++i) {
    const QChar c = line[i];
    if (inString) {
      if (c == '"') {
        if (i + 1 < line.size() && line[i + 1] == '"') {
          ++i;
        } else {
          inString = false;
          out += '"';
        }
      }
      continue;
    }
    if (c == '\'') break;
    if (c == '"') inString = true;
    out += c;
  }
  const QString trimmed = out.trimmed();
  if (trimmed == "Rem" || trimmed.startsWith("Rem ")) return {};
  return trimmed;
}

// Statements separated by colons (not the := of named arguments).
QStringList statements(const QString& text) {
  QStringList parts;
  QString current;
  for (qsizetype i = 0; i < text.size(); ++i) {
    if (text[i] == ':' && (i + 1 >= text.size() || text[i + 1] != '=')) {
      parts << current.trimmed();
      current.clear();
    } else {
      current += text[i];
    }
  }
  parts << current.trimmed();
  return parts;
}

struct Open {
  QString block;  // "proc", "If", "Select", "For", "Do", "While", "With", "#If", "Type", "Enum"
  QString detail;
  int line = 0;
};

bool isStatementBlock(const QString& block) {
  return block == "If" || block == "Select" || block == "For" || block == "Do" || block == "While" ||
         block == "With";
}

}  // namespace

Structure checkStructure(const QStringList& codeLines) {
  static const QRegularExpression lineNumber(R"(^\d+\s+)");
  static const QRegularExpression label(R"(^([A-Za-z_]\w*):(\s|$))");
  static const QRegularExpression procHeader(
      R"(^(?:(?:Public|Private|Friend)\s+)?(?:Static\s+)?(Sub|Function|Property\s+(?:Get|Let|Set))\s+(\w+)\s*\()");
  static const QRegularExpression procEnd(R"(^End\s+(Sub|Function|Property)$)");
  static const QRegularExpression blockIf(R"(^If\b.*\bThen$)");
  static const QRegularExpression lineIf(R"(^If\b.*\bThen\s+\S)");
  static const QRegularExpression elseIf(R"(^ElseIf\b.*\bThen$)");
  static const QRegularExpression directiveIf(R"(^#If\b.*\bThen$)");
  static const QRegularExpression directiveElseIf(R"(^#ElseIf\b.*\bThen$)");
  static const QRegularExpression typeStart(R"(^(?:(?:Public|Private)\s+)?Type\s+\w+$)");
  static const QRegularExpression enumStart(R"(^(?:(?:Public|Private)\s+)?Enum\s+\w+$)");

  Structure result;
  std::vector<Open> stack;
  auto problem = [&](int line, const QString& text) {
    result.problems << QString("code line %1: %2").arg(line + 1).arg(text);
  };
  auto insideProcedure = [&] {
    return std::any_of(stack.begin(), stack.end(), [](const Open& open) { return open.block == "proc"; });
  };
  auto statementDepth = [&] {
    return int(std::count_if(stack.begin(), stack.end(),
                             [](const Open& open) { return isStatementBlock(open.block); }));
  };
  auto close = [&](int line, const QString& block, const QString& what) {
    if (stack.empty() || stack.back().block != block) {
      problem(line, what + (stack.empty() ? QString(" with nothing open")
                                          : QString(" closes %1 opened on code line %2")
                                                .arg(stack.back().block)
                                                .arg(stack.back().line + 1)));
      return;
    }
    stack.pop_back();
  };
  auto open = [&](int line, const QString& block, const QString& detail = {}) {
    if (isStatementBlock(block) && !insideProcedure()) problem(line, block + " outside a procedure");
    stack.push_back({block, detail, line});
    result.maxBlockDepth = std::max(result.maxBlockDepth, statementDepth());
  };
  auto expectTop = [&](int line, const QString& block, const QString& what) {
    if (stack.empty() || stack.back().block != block) problem(line, what + " outside " + block);
  };

  for (int first = 0; first < codeLines.size();) {
    // Join the physical lines of one logical line.
    QString logical;
    int last = first;
    for (;;) {
      const QString& physical = codeLines[last];
      if (physical.size() > 1023) problem(last, "line longer than 1023 characters");
      if (physical.endsWith(" _") && last + 1 < codeLines.size()) {
        logical += physical.left(physical.size() - 1);
        ++last;
      } else {
        logical += physical;
        break;
      }
    }
    if (last - first > 24) problem(first, "more than 24 line continuations");
    const int lineIndex = first;
    const int physicalLines = last - first + 1;
    first = last + 1;

    if (logical.startsWith("Attribute ")) continue;  // hidden member attributes
    QString text = withoutStringsAndComment(logical);
    text.remove(lineNumber);
    const QRegularExpressionMatch labelMatch = label.match(text);
    if (labelMatch.hasMatch() && labelMatch.captured(1) != "Case" && labelMatch.captured(1) != "Else") {
      text = text.mid(labelMatch.capturedLength()).trimmed();
    }
    if (text.isEmpty()) continue;

    for (const QString& statement : statements(text)) {
      if (statement.isEmpty()) continue;
      if (const auto m = procHeader.match(statement); m.hasMatch()) {
        if (insideProcedure()) problem(lineIndex, "procedure " + m.captured(2) + " inside another");
        QString kind = m.captured(1);
        kind.replace(QRegularExpression(R"(\s+)"), " ");
        result.procedures.push_back({kind, m.captured(2), lineIndex, physicalLines});
        open(lineIndex, "proc", kind);
        break;
      }
      if (const auto m = procEnd.match(statement); m.hasMatch()) {
        if (!stack.empty() && stack.back().block == "proc" &&
            !stack.back().detail.startsWith(m.captured(1))) {
          problem(lineIndex, statement + " ends a " + stack.back().detail);
        }
        close(lineIndex, "proc", statement);
        continue;
      }
      if (lineIf.match(statement).hasMatch()) break;  // the rest of the line belongs to the single-line If
      if (blockIf.match(statement).hasMatch()) {
        open(lineIndex, "If");
      } else if (elseIf.match(statement).hasMatch() || statement == "Else") {
        expectTop(lineIndex, "If", statement.section(' ', 0, 0));
      } else if (statement == "End If") {
        close(lineIndex, "If", statement);
      } else if (statement.startsWith("Select Case ")) {
        open(lineIndex, "Select");
      } else if (statement == "Case" || statement.startsWith("Case ")) {
        expectTop(lineIndex, "Select", "Case");
      } else if (statement == "End Select") {
        close(lineIndex, "Select", statement);
      } else if (statement.startsWith("For ")) {
        open(lineIndex, "For");
      } else if (statement == "Next" || statement.startsWith("Next ")) {
        close(lineIndex, "For", statement);
      } else if (statement == "Do" || statement.startsWith("Do ")) {
        open(lineIndex, "Do");
      } else if (statement == "Loop" || statement.startsWith("Loop ")) {
        close(lineIndex, "Do", statement);
      } else if (statement.startsWith("While ")) {
        open(lineIndex, "While");
      } else if (statement == "Wend") {
        close(lineIndex, "While", statement);
      } else if (statement.startsWith("With ")) {
        open(lineIndex, "With");
      } else if (statement == "End With") {
        close(lineIndex, "With", statement);
      } else if (directiveIf.match(statement).hasMatch()) {
        open(lineIndex, "#If");
      } else if (directiveElseIf.match(statement).hasMatch() || statement == "#Else") {
        expectTop(lineIndex, "#If", statement);
      } else if (statement == "#End If") {
        close(lineIndex, "#If", statement);
      } else if (typeStart.match(statement).hasMatch()) {
        if (insideProcedure()) problem(lineIndex, "Type inside a procedure");
        open(lineIndex, "Type");
      } else if (statement == "End Type") {
        close(lineIndex, "Type", statement);
      } else if (enumStart.match(statement).hasMatch()) {
        if (insideProcedure()) problem(lineIndex, "Enum inside a procedure");
        open(lineIndex, "Enum");
      } else if (statement == "End Enum") {
        close(lineIndex, "Enum", statement);
      }
    }
  }
  for (const Open& open : stack)
    problem(open.line, open.block + " " + open.detail + " is never closed");
  return result;
}

std::vector<ProjectEntry> projectEntries(const QStringList& vbpLines) {
  std::vector<ProjectEntry> entries;
  for (const QString& line : vbpLines) {
    const qsizetype equals = line.indexOf('=');
    if (equals < 0) continue;
    const QString key = line.left(equals);
    const QString value = line.mid(equals + 1);
    if (key == "Module" || key == "Class") {
      entries.push_back({key, value.section(';', 0, 0).trimmed(), value.section(';', 1).trimmed()});
    } else if (key == "Form" || key == "UserControl") {
      entries.push_back({key, QString(), value.trimmed()});
    }
  }
  return entries;
}

QString keyValue(const QStringList& lines, const QString& key) {
  for (const QString& line : lines) {
    if (line.startsWith(key + '=')) return line.mid(key.size() + 1);
  }
  return QString();
}

QString vbName(const QStringList& lines) {
  static const QRegularExpression pattern(R"re(^Attribute VB_Name = "([^"]*)"$)re");
  for (const QString& line : lines) {
    if (const auto m = pattern.match(line); m.hasMatch()) return m.captured(1);
  }
  return {};
}

QString resolve(const QString& baseDir, const QString& relative) {
  QString path = relative;
  path.replace('\\', '/');
  return QDir::cleanPath(QDir(baseDir).absoluteFilePath(path));
}

}  // namespace vbcheck
