// SPDX-License-Identifier: MIT
// One pass over a module's lines: the header parts in the order the IDE writes them, then the code with its
// hidden attribute lines moved aside and remembered by the code line they follow.
#include "host/files/modulefile.h"

#include "ide/error.h"
#include "syntax/line.h"

#include <algorithm>
#include <utility>

namespace host {
namespace {

/// Whether the line's first word is `word` (case-insensitively), followed by a blank or the line's end;
/// `after` receives the position after the word.
bool startsWithWord(QStringView text, QStringView word, qsizetype* after = nullptr) {
  const qsizetype start = syntax::skipBlanks(text, 0);
  if (text.size() - start < word.size()) return false;
  if (text.mid(start, word.size()).compare(word, Qt::CaseInsensitive) != 0) return false;
  const qsizetype end = start + word.size();
  if (end < text.size() && !syntax::isBlank(text[end])) return false;
  if (after) *after = end;
  return true;
}

bool isObjectLine(QStringView text) {
  const qsizetype start = syntax::skipBlanks(text, 0);
  if (text.mid(start, 6).compare(u"Object", Qt::CaseInsensitive) != 0) return false;
  const qsizetype next = syntax::skipBlanks(text, start + 6);
  return next < text.size() && text[next] == u'=';
}

[[noreturn]] void failAt(const QString& fileName, std::size_t lineIndex, const QString& problem) {
  throw ide::Error(ide::err::InvalidFileFormat,
                   QStringLiteral("%1, line %2: %3").arg(fileName).arg(lineIndex + 1).arg(problem));
}

}  // namespace

namespace {

/// Reads the header parts from `lines` into `source`; returns the index of the first line after them.
std::size_t parseHead(const FormDescription::Lines& lines, ModuleSource& source, const QString& fileName) {
  std::size_t position = 0;
  const SourceLine* line = lines(position);
  if (line && startsWithWord(line->text, u"VERSION")) {
    source.preamble.push_back(*line);
    while ((line = lines(++position)) && isObjectLine(line->text))
      source.preamble.push_back(*line);
    qsizetype afterBegin = 0;
    if (line && startsWithWord(line->text, u"Begin", &afterBegin)) {
      if (syntax::skipBlanks(line->text, afterBegin) == line->text.size()) {
        // A class's BEGIN ... END block of persisted settings: kept raw.
        const std::size_t beginIndex = position;
        do {
          source.preamble.push_back(*line);
          line = lines(++position);
        } while (line && line->text.trimmed().compare(u"END", Qt::CaseInsensitive) != 0);
        if (!line) failAt(fileName, beginIndex, QStringLiteral("BEGIN without END"));
        source.preamble.push_back(*line);
        ++position;
      } else {
        source.form = FormDescription::parse(lines, position, fileName);
      }
    }
  }
  while ((line = lines(position)) && syntax::isModuleAttribute(line->text)) {
    source.moduleAttributes.push_back(*line);
    ++position;
  }
  return position;
}

/// Appends the code lines to `source`, moving the hidden attribute lines aside; `lines` are taken.
void splitCode(std::vector<SourceLine>& lines, ModuleSource& source) {
  source.code.reserve(source.code.size() + lines.size());
  bool continued = false;
  for (SourceLine& line : lines) {
    if (!continued && syntax::isAttributeStatement(line.text)) {
      source.memberAttributes.push_back(
          MemberAttributeLine{static_cast<int>(source.code.size()), std::move(line)});
      continue;
    }
    continued = syntax::continues(line.text);
    source.code.push_back(std::move(line));
  }
}

}  // namespace

ModuleSource parseModuleLines(const std::vector<SourceLine>& lines, const QString& fileName) {
  ModuleSource source;
  const std::size_t codeStart = parseHead(
      [&](std::size_t index) { return index < lines.size() ? &lines[index] : nullptr; }, source, fileName);
  std::vector<SourceLine> code(lines.begin() + static_cast<std::ptrdiff_t>(codeStart), lines.end());
  splitCode(code, source);
  return source;
}

ModuleHead parseModuleHead(QByteArrayView bytes, const QString& fileName) {
  ModuleHead head;
  SourceLineReader reader(bytes, fileName);
  head.codeLine =
      static_cast<int>(parseHead([&](std::size_t index) { return reader.at(index); }, head.source, fileName));
  // The reader may have read the first code line too, to see that it is not part of the head.
  head.codeOffset = reader.start(static_cast<std::size_t>(head.codeLine));
  return head;
}

void parseModuleCode(QByteArrayView code, const QString& fileName, int firstLine, ModuleSource& into) {
  std::vector<SourceLine> lines = readSourceLines(code, fileName, firstLine);
  splitCode(lines, into);
}

ModuleSource parseModule(QByteArrayView bytes, const QString& fileName) {
  ModuleHead head = parseModuleHead(bytes, fileName);
  parseModuleCode(bytes.sliced(head.codeOffset), fileName, head.codeLine, head.source);
  return std::move(head.source);
}

QByteArray writeModule(const ModuleSource& source, const QString& fileName) {
  std::vector<SourceLine> formLines;
  if (source.form) source.form->appendLines(formLines);

  // Edits may have appended member attributes out of order; write each after its code line all the same.
  std::vector<const MemberAttributeLine*> attributes;
  attributes.reserve(source.memberAttributes.size());
  for (const MemberAttributeLine& attribute : source.memberAttributes)
    attributes.push_back(&attribute);
  const auto byCodeLine = [](const MemberAttributeLine* left, const MemberAttributeLine* right) {
    return left->afterCodeLine < right->afterCodeLine;
  };
  if (!std::is_sorted(attributes.begin(), attributes.end(), byCodeLine)) {
    std::stable_sort(attributes.begin(), attributes.end(), byCodeLine);
  }

  qsizetype estimate = 0;
  for (const std::vector<SourceLine>* part :
       {&source.preamble, &std::as_const(formLines), &source.moduleAttributes, &source.code}) {
    for (const SourceLine& line : *part)
      estimate += line.text.size() + 2;
  }
  for (const MemberAttributeLine& attribute : source.memberAttributes)
    estimate += attribute.line.text.size() + 2;

  QByteArray out;
  out.reserve(estimate);
  int lineNumber = 0;
  LineEnd previous = LineEnd::None;
  const auto write = [&](const SourceLine& line) {
    // Only the last line of a file read from disk lacks a line end; after edits put lines behind it, it
    // needs one to stay a line of its own.
    if (lineNumber > 0 && previous == LineEnd::None) {
      out.append("\r\n");
      previous = LineEnd::CRLF;
    }
    previous = appendSourceLine(out, line, fileName, ++lineNumber, previous);
  };
  for (const std::vector<SourceLine>* part :
       {&source.preamble, &std::as_const(formLines), &source.moduleAttributes}) {
    for (const SourceLine& line : *part)
      write(line);
  }
  auto nextAttribute = attributes.begin();
  const auto writeAttributesThrough = [&](int codeLine) {
    while (nextAttribute != attributes.end() && (*nextAttribute)->afterCodeLine <= codeLine) {
      write((*nextAttribute)->line);
      ++nextAttribute;
    }
  };
  writeAttributesThrough(0);
  int codeLine = 0;
  for (const SourceLine& line : source.code) {
    write(line);
    writeAttributesThrough(++codeLine);
  }
  while (nextAttribute != attributes.end())
    write((*nextAttribute++)->line);
  return out;
}

std::optional<QString> moduleAttribute(const ModuleSource& source, QStringView name) {
  for (const SourceLine& line : source.moduleAttributes) {
    const std::optional<syntax::AttributeLine> parts = syntax::parseAttribute(line.text);
    if (parts && parts->name.compare(name, Qt::CaseInsensitive) == 0) return parts->value.toString();
  }
  return std::nullopt;
}

void setModuleAttribute(ModuleSource& source, const QString& name, const QString& rawValue) {
  const QString text = QStringLiteral("Attribute %1 = %2").arg(name, rawValue);
  for (SourceLine& line : source.moduleAttributes) {
    const std::optional<syntax::AttributeLine> parts = syntax::parseAttribute(line.text);
    if (parts && parts->name.compare(name, Qt::CaseInsensitive) == 0) {
      if (parts->value != rawValue) line.text = text;
      return;
    }
  }
  // A new header line ends like the header around it; code follows, so it always needs a line end.
  LineEnd end = lineEndAt(source.moduleAttributes, source.moduleAttributes.size());
  if (source.moduleAttributes.empty()) end = lineEndAt(source.preamble, source.preamble.size());
  if (source.moduleAttributes.empty() && source.preamble.empty()) end = lineEndAt(source.code, 0);
  if (!source.moduleAttributes.empty() && source.moduleAttributes.back().end == LineEnd::None) {
    source.moduleAttributes.back().end = end;
  }
  source.moduleAttributes.push_back(SourceLine{text, end});
}

QString moduleName(const ModuleSource& source) {
  const std::optional<QString> value = moduleAttribute(source, u"VB_Name");
  if (!value) return {};
  return unquoteVbString(*value).value_or(*value);
}

void setModuleName(ModuleSource& source, const QString& name) {
  const bool hadName = moduleAttribute(source, u"VB_Name").has_value();
  if (hadName) {
    setModuleAttribute(source, QStringLiteral("VB_Name"), quoteVbString(name));
  } else {
    // VB_Name is always the first header attribute.
    LineEnd end = LineEnd::CRLF;
    if (!source.moduleAttributes.empty()) {
      end = lineEndAt(source.moduleAttributes, 0);
    } else if (!source.preamble.empty()) {
      end = lineEndAt(source.preamble, source.preamble.size());
    } else {
      end = lineEndAt(source.code, 0);
    }
    source.moduleAttributes.insert(
        source.moduleAttributes.begin(),
        SourceLine{QStringLiteral("Attribute VB_Name = ") + quoteVbString(name), end});
  }
  if (source.form) source.form->root().setName(name);
}

}  // namespace host
