// SPDX-License-Identifier: MIT
#include "host/code/codetext.h"

#include "host/code/findmatcher.h"
#include "ide/error.h"

#include <QHash>
#include <QSet>

#include <algorithm>
#include <limits>

namespace host {
namespace {

/// Splits text at CRLF, CR or LF; a trailing line end yields a last, empty line, as the IDE inserts it.
std::vector<QStringView> splitLines(QStringView text) {
  std::vector<QStringView> parts;
  qsizetype start = 0;
  for (qsizetype i = 0; i < text.size(); ++i) {
    const QChar c = text[i];
    if (c != u'\r' && c != u'\n') continue;
    parts.push_back(text.sliced(start, i - start));
    if (c == u'\r' && i + 1 < text.size() && text[i + 1] == u'\n') ++i;
    start = i + 1;
  }
  parts.push_back(text.sliced(start));
  return parts;
}

void checkLength(QStringView line) {
  if (line.size() > kMaxLineLength) ide::raise(ide::err::LineTooLong);
}

QString nameKey(QStringView name, ide::ProcKind kind) {
  QString key = name.toString().toCaseFolded();
  key.append(QChar(u'0' + static_cast<int>(kind)));
  return key;
}

/// The parts of a hidden attribute line; empty parts for another line.
syntax::AttributeLine splitAttribute(QStringView text) {
  return syntax::parseAttribute(text).value_or(syntax::AttributeLine{});
}

bool sameName(QStringView a, QStringView b) {
  return a.compare(b, Qt::CaseInsensitive) == 0;
}

}  // namespace

struct CodeText::Index {
  std::vector<ProcInfo> procs;
  QHash<QString, size_t> byName;  // folded name + kind digit -> procs index
  int declarationLines = 0;

  bool membersValid = false;
  std::vector<MemberInfo> members;
  QHash<QString, size_t> memberByName;  // folded name -> members index
  /// Declare statements: listed as methods and answered by the procedure queries.
  std::vector<ProcInfo> declares;
  /// Type and Enum blocks in line order: first and End line (INT_MAX for a block without one).
  std::vector<std::pair<int, int>> blocks;
};

CodeText::CodeText() : m_index(std::make_unique<Index>()) {}
CodeText::~CodeText() = default;

// ---------------------------------------------------------------------------------------------------
// Loading and storing

CodeText::Line CodeText::makeLine(QStringView text, bool isContinuation, LineEnd end) const {
  Line line;
  line.text = text.toString();
  line.end = end;
  line.kind = syntax::kindOf(text, isContinuation);
  line.continues = syntax::continues(text);
  return line;
}

void CodeText::load(std::vector<SourceLine> code, std::vector<MemberAttributeLine> attributes) {
  const int removed = countOfLines();
  m_lines.clear();
  // Room for the lines an editing session adds: growing a large module's line vector on its first new line
  // would move every line at once, a pause the user feels on that keystroke.
  m_lines.reserve(code.size() + code.size() / 4 + 16);
  m_markers.clear();
  m_orphanAttributes.clear();
  m_leadingAttributes.clear();
  bool continuation = false;
  for (SourceLine& source : code) {
    Line line;
    line.kind = syntax::kindOf(source.text, continuation);
    line.continues = syntax::continues(source.text);
    line.text = std::move(source.text);
    line.end = source.end;
    continuation = line.continues;
    if (syntax::isStructural(line.kind)) m_markers.push_back(static_cast<int>(m_lines.size()) + 1);
    m_lines.push_back(std::move(line));
  }
  for (MemberAttributeLine& attribute : attributes) {
    // Attribute lines above the first code line stay there: they follow no line that could take them.
    if (attribute.afterCodeLine < 1) {
      m_leadingAttributes.push_back(std::move(attribute.line));
      continue;
    }
    if (attribute.afterCodeLine > countOfLines()) {
      m_orphanAttributes.push_back(std::move(attribute.line));
      continue;
    }
    attach(attribute.afterCodeLine, std::move(attribute.line));
  }
  touch(1, removed, countOfLines(), true);
}

void CodeText::shrinkToFit() {
  m_lines.shrink_to_fit();
  m_markers.shrink_to_fit();
  if (!m_indexValid) *m_index = Index();
}

void CodeText::store(std::vector<SourceLine>& code, std::vector<MemberAttributeLine>& attributes) {
  code.clear();
  attributes.clear();
  code.reserve(m_lines.size());

  // Attributes of deleted lines go back to a member of their owner's name, unless it has one already.
  std::vector<std::pair<int, SourceLine>> rehomed;
  QSet<QString> taken;
  for (const SourceLine& orphan : m_orphanAttributes) {
    const syntax::AttributeLine parts = splitAttribute(orphan.text);
    if (parts.owner.isEmpty()) continue;
    Line* attachedTo = nullptr;
    findMemberAttribute(parts.owner, parts.attribute, &attachedTo);
    const QString key = (parts.owner.toString() + u'.' + parts.attribute.toString()).toCaseFolded();
    if (attachedTo || taken.contains(key)) continue;
    if (const int anchor = memberAnchorLine(parts.owner)) {
      rehomed.emplace_back(anchor, orphan);
      taken.insert(key);
    }
  }

  for (int n = 1; n <= countOfLines(); ++n) {
    const Line& line = m_lines[static_cast<size_t>(n - 1)];
    code.push_back(SourceLine{line.text, line.end});
    if (!line.attributes) continue;
    // The attributes a header's procedure owned follow it when it is renamed; others stay as written.
    const QString header = headerNameAt(n);
    for (const SourceLine& attribute : line.attributes->lines) {
      SourceLine out = attribute;
      const syntax::AttributeLine parts = splitAttribute(attribute.text);
      if (!header.isEmpty() && sameName(parts.owner, line.attributes->owner) &&
          !sameName(parts.owner, header)) {
        out.text = attribute.text.left(parts.ownerStart) + header +
                   attribute.text.sliced(parts.ownerStart + parts.owner.size());
      }
      attributes.push_back(MemberAttributeLine{n, std::move(out)});
    }
  }
  for (auto& [anchor, line] : rehomed)
    attributes.push_back(MemberAttributeLine{anchor, std::move(line)});
  for (const SourceLine& line : m_leadingAttributes)
    attributes.push_back(MemberAttributeLine{0, line});
  std::stable_sort(attributes.begin(), attributes.end(),
                   [](const MemberAttributeLine& a, const MemberAttributeLine& b) {
                     return a.afterCodeLine < b.afterCodeLine;
                   });
}

void CodeText::attach(int lineNumber, SourceLine attribute) {
  auto& slot = m_lines[static_cast<size_t>(lineNumber - 1)].attributes;
  if (!slot) {
    slot = std::make_unique<Attributes>();
    slot->owner = headerNameAt(lineNumber);
  }
  slot->lines.push_back(std::move(attribute));
}

bool CodeText::continuesStructural(int lineNumber) const {
  if (m_lines[static_cast<size_t>(lineNumber - 1)].kind != syntax::Kind::Continuation) return false;
  int start = lineNumber;
  while (start > 1 && m_lines[static_cast<size_t>(start - 1)].kind == syntax::Kind::Continuation)
    --start;
  return syntax::isStructural(m_lines[static_cast<size_t>(start - 1)].kind);
}

QString CodeText::headerNameAt(int lineNumber) const {
  const syntax::Kind kind = m_lines[static_cast<size_t>(lineNumber - 1)].kind;
  if (kind != syntax::Kind::ProcHeader && kind != syntax::Kind::Continuation) return {};
  int start = lineNumber;
  while (start > 1 && m_lines[static_cast<size_t>(start - 1)].kind == syntax::Kind::Continuation)
    --start;
  if (m_lines[static_cast<size_t>(start - 1)].kind != syntax::Kind::ProcHeader) return {};
  const auto header = syntax::parseProcHeader(statementText(start, statementEnd(start)));
  return header ? header->name : QString();
}

// ---------------------------------------------------------------------------------------------------
// Reading

void CodeText::checkLineNumber(int line, int last) const {
  if (line < 1 || line > last) ide::raise(ide::err::SubscriptOutOfRange);
}

QString CodeText::lines(int startLine, int count) const {
  if (count < 0) ide::raise(ide::err::InvalidProcedureCall);
  if (startLine < 1) ide::raise(ide::err::SubscriptOutOfRange);
  if (count == 0 || startLine > countOfLines()) return {};
  const int last = std::min(countOfLines(), startLine + count - 1);
  if (startLine == last) return line(startLine);
  QString joined;
  for (int n = startLine; n <= last; ++n) {
    if (n > startLine) joined += QLatin1StringView("\r\n");
    joined += line(n);
  }
  return joined;
}

int CodeText::statementEnd(int firstLine) const {
  int last = firstLine;
  while (last < countOfLines() && m_lines[static_cast<size_t>(last - 1)].continues)
    ++last;
  return last;
}

QString CodeText::statementText(int firstLine, int lastLine) const {
  if (firstLine == lastLine) return line(firstLine);
  std::vector<QStringView> parts;
  for (int n = firstLine; n <= lastLine; ++n)
    parts.push_back(line(n));
  return syntax::joinContinuedLines(parts);
}

// ---------------------------------------------------------------------------------------------------
// The index

CodeText::Index& CodeText::index() {
  if (!m_indexValid) rebuildIndex();
  return *m_index;
}

void CodeText::rebuildIndex() {
  Index& index = *m_index;
  index.procs.clear();
  index.byName.clear();
  index.membersValid = false;
  index.members.clear();
  index.declares.clear();
  index.blocks.clear();

  // Every line of a Type or Enum block up to its End line is a member of the block, whatever it looks
  // like. A block without an End line (one being typed) takes in the declarations below it, but not the
  // procedures: the index reads on past its first line.
  constexpr size_t kNone = static_cast<size_t>(-1);
  std::vector<size_t> nextTypeEnd(m_markers.size() + 1, kNone);
  std::vector<size_t> nextEnumEnd(m_markers.size() + 1, kNone);
  for (size_t k = m_markers.size(); k-- > 0;) {
    const syntax::Kind lineKind = m_lines[static_cast<size_t>(m_markers[k] - 1)].kind;
    nextTypeEnd[k] = lineKind == syntax::Kind::TypeEnd ? k : nextTypeEnd[k + 1];
    nextEnumEnd[k] = lineKind == syntax::Kind::EnumEnd ? k : nextEnumEnd[k + 1];
  }

  // Conditional compilation: a header in another branch of the #If block that holds the header of a
  // procedure still open is an alternative header of that procedure (one body, one End line), not a
  // procedure of its own. Blocks are told apart by a number given at their #If.
  struct Branch {
    int block = -1;  // -1: outside any #If block
    int branch = 0;
  };
  std::vector<Branch> blocks;
  int nextBlock = 0;
  const auto here = [&] { return blocks.empty() ? Branch{} : blocks.back(); };

  ProcInfo* open = nullptr;
  Branch openAt;
  for (size_t k = 0; k < m_markers.size(); ++k) {
    const int marker = m_markers[k];
    const Line& line = m_lines[static_cast<size_t>(marker - 1)];
    switch (line.kind) {
      case syntax::Kind::DirectiveIf:
        blocks.push_back({nextBlock++, 0});
        continue;
      case syntax::Kind::DirectiveElseIf:
      case syntax::Kind::DirectiveElse:
        if (!blocks.empty()) ++blocks.back().branch;
        continue;
      case syntax::Kind::DirectiveEndIf:
        if (blocks.empty()) continue;
        // The #End If right after the last alternative header closes the header.
        if (open && open->hasAlternatives && openAt.block == blocks.back().block &&
            marker == open->headerEnd + 1)
          open->headerEnd = marker;
        blocks.pop_back();
        continue;
      default:
        break;
    }
    if (line.kind == syntax::Kind::TypeBegin || line.kind == syntax::Kind::EnumBegin) {
      const size_t end = (line.kind == syntax::Kind::TypeBegin ? nextTypeEnd : nextEnumEnd)[k + 1];
      index.blocks.emplace_back(marker, end == kNone ? std::numeric_limits<int>::max() : m_markers[end]);
      if (end != kNone) k = end;
      continue;
    }
    if (line.kind == syntax::Kind::TypeEnd || line.kind == syntax::Kind::EnumEnd)
      continue;  // one without a block
    if (line.kind == syntax::Kind::ProcHeader) {
      const int headerEnd = statementEnd(marker);
      auto header = syntax::parseProcHeader(statementText(marker, headerEnd));
      if (!header) continue;
      const Branch branch = here();
      if (open && openAt.block >= 0 && branch.block == openAt.block && branch.branch != openAt.branch) {
        open->headerEnd = headerEnd;
        open->hasAlternatives = true;
        openAt = branch;
        continue;
      }
      if (open) open->endLine = marker - 1;  // a header without its End line runs up to the next header
      ProcInfo& proc = index.procs.emplace_back();
      proc.name = std::move(header->name);
      proc.kind = header->kind;
      proc.isFunction = header->isFunction;
      proc.scope = header->scope;
      proc.isStatic = header->isStatic;
      proc.bodyLine = marker;
      proc.headerEnd = headerEnd;
      open = &proc;
      openAt = branch;
    } else if (open) {  // an End line; one with no header above it closes nothing
      open->endLine = marker;
      open = nullptr;
    }
  }
  if (open) open->endLine = countOfLines();

  for (size_t i = 0; i < index.procs.size(); ++i) {
    const QString key = nameKey(index.procs[i].name, index.procs[i].kind);
    if (!index.byName.contains(key)) index.byName.insert(key, i);  // a duplicate answers with the first
  }

  m_firstHeaderLine = index.procs.empty() ? 0 : index.procs.front().bodyLine;
  if (m_firstHeaderLine > 0) {
    // Blank and comment lines right above the first header belong to it; a continued comment too.
    int n = m_firstHeaderLine - 1;
    while (n > 0) {
      int start = n;
      while (start > 1 && m_lines[static_cast<size_t>(start - 1)].kind == syntax::Kind::Continuation)
        --start;
      if (!syntax::isBlankOrComment(m_lines[static_cast<size_t>(start - 1)].kind)) break;
      n = start - 1;
    }
    index.declarationLines = n;
  } else {
    int n = countOfLines();
    while (n > 0 && m_lines[static_cast<size_t>(n - 1)].kind == syntax::Kind::Blank)
      --n;
    index.declarationLines = n;
  }
  m_indexValid = true;
}

int CodeText::countOfDeclarationLines() {
  return index().declarationLines;
}

const std::vector<ProcInfo>& CodeText::procedures() {
  return index().procs;
}

const ProcInfo* CodeText::findProc(QStringView name, ide::ProcKind kind) {
  Index& idx = index();
  const auto found = idx.byName.constFind(nameKey(name.trimmed(), kind));
  if (found != idx.byName.cend()) return &idx.procs[*found];
  if (kind == ide::ProcKind::Proc) {
    members();  // also collects the Declare statements
    for (const ProcInfo& declare : idx.declares)
      if (sameName(declare.name, name.trimmed())) return &declare;
  }
  return nullptr;
}

namespace {
[[noreturn]] void raiseNotDefined() {
  ide::raise(ide::err::SubOrFunctionNotDefined);
}
}  // namespace

int CodeText::procStartLine(QStringView name, ide::ProcKind kind) {
  const ProcInfo* proc = findProc(name, kind);
  if (!proc) raiseNotDefined();
  // A Declare statement starts where it stands: it sits in the declarations, not between procedures.
  if (proc->isDeclare) return proc->bodyLine;
  return startLineOf(static_cast<size_t>(proc - m_index->procs.data()));
}

int CodeText::procBodyLine(QStringView name, ide::ProcKind kind) {
  const ProcInfo* proc = findProc(name, kind);
  if (!proc) raiseNotDefined();
  return proc->bodyLine;
}

int CodeText::procCountLines(QStringView name, ide::ProcKind kind) {
  const ProcInfo* proc = findProc(name, kind);
  if (!proc) raiseNotDefined();
  if (proc->isDeclare) return proc->headerEnd - proc->bodyLine + 1;
  const size_t i = static_cast<size_t>(proc - m_index->procs.data());
  return lastLineOf(i) - startLineOf(i) + 1;
}

int CodeText::startLineOf(size_t i) const {
  const Index& idx = *m_index;
  return i == 0 ? idx.declarationLines + 1 : idx.procs[i - 1].endLine + 1;
}

int CodeText::lastLineOf(size_t i) const {
  const Index& idx = *m_index;
  return i + 1 == idx.procs.size() ? countOfLines() : idx.procs[i].endLine;
}

std::vector<ide::ProcExtent> CodeText::procedureExtents() {
  const Index& idx = index();
  std::vector<ide::ProcExtent> extents;
  extents.reserve(idx.procs.size());
  for (size_t i = 0; i < idx.procs.size(); ++i)
    extents.push_back(extentAt(i));
  return extents;
}

ide::ProcExtent CodeText::extentAt(size_t i) const {
  const ProcInfo& proc = m_index->procs[i];
  const int start = startLineOf(i);
  return {proc.name, proc.kind, start, proc.bodyLine, proc.headerEnd, lastLineOf(i) - start + 1};
}

const ProcInfo* CodeText::owner(int line) {
  checkLineNumber(line, countOfLines());
  const Index& idx = index();
  if (idx.procs.empty() || line <= idx.declarationLines) return nullptr;
  // The owner is the first procedure whose End line is at or below the line; the last one owns the rest.
  auto it = std::lower_bound(idx.procs.begin(), idx.procs.end(), line,
                             [](const ProcInfo& proc, int value) { return proc.endLine < value; });
  return it == idx.procs.end() ? &idx.procs.back() : &*it;
}

QString CodeText::procOfLine(int line, ide::ProcKind& kind) {
  const ProcInfo* proc = owner(line);
  kind = proc ? proc->kind : ide::ProcKind::Proc;
  return proc ? proc->name : QString();
}

std::optional<ide::ProcExtent> CodeText::extentOfLine(int line) {
  const ProcInfo* proc = owner(line);
  if (!proc) return std::nullopt;
  return extentAt(static_cast<size_t>(proc - m_index->procs.data()));
}

const std::vector<MemberInfo>& CodeText::members() {
  Index& idx = index();
  if (idx.membersValid) return idx.members;
  idx.members.clear();
  idx.declares.clear();
  QHash<QString, size_t>& seen = idx.memberByName;
  seen.clear();
  auto add = [&](MemberInfo info) {
    const QString key = info.name.toCaseFolded();
    if (seen.contains(key)) return;
    seen.insert(key, idx.members.size());
    idx.members.push_back(std::move(info));
  };

  const int declarationsEnd = m_firstHeaderLine > 0 ? m_firstHeaderLine - 1 : countOfLines();
  auto block = idx.blocks.cbegin();  // the lines of a Type or Enum block are its fields, not members
  for (int n = 1; n <= declarationsEnd; ++n) {
    while (block != idx.blocks.cend() && block->second < n)
      ++block;
    if (block != idx.blocks.cend() && block->first <= n) continue;
    const syntax::Kind lineKind = m_lines[static_cast<size_t>(n - 1)].kind;
    switch (lineKind) {
      case syntax::Kind::Variable:
      case syntax::Kind::Const:
      case syntax::Kind::Event:
      case syntax::Kind::Declare: {
        const int last = statementEnd(n);
        const auto decl = syntax::parseDeclaration(statementText(n, last));
        if (!decl) break;
        for (const QString& name : decl->names) {
          add(MemberInfo{name, decl->type, decl->scope, decl->isStatic, n});
          if (lineKind == syntax::Kind::Declare) {
            ProcInfo declare;
            declare.name = name;
            declare.scope = decl->scope;
            declare.isDeclare = true;
            declare.bodyLine = n;
            declare.headerEnd = last;
            declare.endLine = last;
            idx.declares.push_back(std::move(declare));
          }
        }
        break;
      }
      default:
        break;
    }
  }
  for (size_t i = 0; i < idx.procs.size(); ++i) {
    const ProcInfo& proc = idx.procs[i];
    const int start = i == 0 ? idx.declarationLines + 1 : idx.procs[i - 1].endLine + 1;
    add(MemberInfo{proc.name,
                   proc.kind == ide::ProcKind::Proc ? ide::MemberType::Method : ide::MemberType::Property,
                   proc.scope, proc.isStatic, start});
  }
  idx.membersValid = true;
  return idx.members;
}

std::optional<MemberInfo> CodeText::member(QStringView name) {
  const std::vector<MemberInfo>& all = members();
  const auto found = m_index->memberByName.constFind(name.toString().toCaseFolded());
  if (found == m_index->memberByName.cend()) return std::nullopt;
  return all[*found];
}

// ---------------------------------------------------------------------------------------------------
// Member attributes

std::vector<std::pair<int, int>> CodeText::memberLineRanges(QStringView member) {
  std::vector<std::pair<int, int>> ranges;
  const auto info = this->member(member);
  if (!info) return ranges;
  if (info->type == ide::MemberType::Property || info->type == ide::MemberType::Method) {
    const auto kinds = info->type == ide::MemberType::Property
                           ? std::vector{ide::ProcKind::Get, ide::ProcKind::Let, ide::ProcKind::Set}
                           : std::vector{ide::ProcKind::Proc};
    for (const ide::ProcKind kind : kinds)
      if (const ProcInfo* proc = findProc(member, kind)) ranges.emplace_back(proc->bodyLine, proc->headerEnd);
  } else {
    ranges.emplace_back(info->line, statementEnd(info->line));
  }
  return ranges;
}

int CodeText::memberAnchorLine(QStringView member) {
  const auto ranges = memberLineRanges(member);
  return ranges.empty() ? 0 : ranges.front().second;
}

SourceLine* CodeText::findMemberAttribute(QStringView member, QStringView attribute, Line** owner) {
  auto matches = [&](const SourceLine& line) {
    const syntax::AttributeLine parts = splitAttribute(line.text);
    return sameName(parts.owner, member) && sameName(parts.attribute, attribute);
  };
  // A member's attributes follow the lines of its declaration (any accessor of a property).
  for (const auto& [first, last] : memberLineRanges(member)) {
    for (int n = first; n <= last; ++n) {
      Line& line = m_lines[static_cast<size_t>(n - 1)];
      if (!line.attributes) continue;
      for (SourceLine& attributeLine : line.attributes->lines) {
        if (!matches(attributeLine)) continue;
        if (owner) *owner = &line;
        return &attributeLine;
      }
    }
  }
  for (std::vector<SourceLine>* unattached : {&m_orphanAttributes, &m_leadingAttributes}) {
    for (SourceLine& line : *unattached) {
      if (!matches(line)) continue;
      if (owner) *owner = nullptr;
      return &line;
    }
  }
  return nullptr;
}

std::optional<QString> CodeText::memberAttribute(QStringView member, QStringView attribute) {
  const SourceLine* line = findMemberAttribute(member, attribute, nullptr);
  if (!line) return std::nullopt;
  return splitAttribute(line->text).value.toString();
}

void CodeText::setMemberAttribute(QStringView member, QStringView attribute,
                                  const std::optional<QString>& valueText) {
  Line* owner = nullptr;
  if (SourceLine* existing = findMemberAttribute(member, attribute, &owner)) {
    if (valueText) {
      const syntax::AttributeLine parts = splitAttribute(existing->text);
      const qsizetype valueStart =
          parts.value.isNull() ? existing->text.size() : parts.value.data() - existing->text.constData();
      existing->text = existing->text.left(valueStart) + *valueText;
    } else {
      const auto isExisting = [existing](const SourceLine& l) { return &l == existing; };
      if (owner) std::erase_if(owner->attributes->lines, isExisting);
      std::erase_if(m_orphanAttributes, isExisting);
      std::erase_if(m_leadingAttributes, isExisting);
    }
    ++m_changeCount;
    return;
  }
  if (!valueText) return;
  const int anchor = memberAnchorLine(member);
  if (anchor == 0) ide::raise(ide::err::SubscriptOutOfRange);
  const auto info = this->member(member);
  attach(anchor, SourceLine{QStringLiteral("Attribute %1.%2 = %3").arg(info->name, attribute, *valueText),
                            newLineEnd()});
  ++m_changeCount;
}

// ---------------------------------------------------------------------------------------------------
// Editing

LineEnd CodeText::newLineEnd() const {
  for (const Line& line : m_lines)
    if (line.end != LineEnd::None) return line.end;
  return LineEnd::CRLF;
}

void CodeText::shiftMarkers(int fromLine, int delta) {
  auto it = std::lower_bound(m_markers.begin(), m_markers.end(), fromLine);
  for (; it != m_markers.end(); ++it)
    *it += delta;
}

void CodeText::updateMarker(int lineNumber, bool wasStructural, bool isNowStructural) {
  if (wasStructural == isNowStructural) return;
  ++m_markerEdits;
  const auto it = std::lower_bound(m_markers.begin(), m_markers.end(), lineNumber);
  if (isNowStructural)
    m_markers.insert(it, lineNumber);
  else if (it != m_markers.end() && *it == lineNumber)
    m_markers.erase(it);
}

void CodeText::insertMarkers(int firstLine, int count) {
  for (int n = firstLine; n < firstLine + count; ++n)
    updateMarker(n, false, syntax::isStructural(m_lines[static_cast<size_t>(n - 1)].kind));
}

/// Re-reads one line whose predecessor changed: it may have started or stopped being a continuation.
void CodeText::reclassifyFrom(size_t index) {
  if (index >= m_lines.size()) return;
  Line& line = m_lines[index];
  const bool continuation = index > 0 && m_lines[index - 1].continues;
  const syntax::Kind lineKind = syntax::kindOf(line.text, continuation);
  if (lineKind == line.kind) return;
  updateMarker(static_cast<int>(index) + 1, syntax::isStructural(line.kind), syntax::isStructural(lineKind));
  line.kind = lineKind;
}

void CodeText::touch(int firstLine, int removed, int inserted, bool structural) {
  ++m_changeCount;
  if (m_indexValid) {
    const bool inDeclarations = m_firstHeaderLine == 0 || firstLine <= m_firstHeaderLine;
    if (structural) {
      m_indexValid = false;
    } else if (removed == inserted) {
      // The lines kept their places and kinds: the procedures stand; a declaration may name another member.
      if (inDeclarations) m_index->membersValid = false;
    } else if (inDeclarations || !shiftIndex(firstLine, removed, inserted)) {
      m_indexValid = false;
    }
  }
  for (Listener* listener : std::vector<Listener*>(m_listeners))
    listener->linesChanged(firstLine, removed, inserted);
}

// Lines that come or go inside procedure bodies only move the procedures below them: the index follows
// by arithmetic instead of reading every header again, which keeps typing Enter in a large module cheap.
bool CodeText::shiftIndex(int firstLine, int removed, int inserted) {
  Index& index = *m_index;
  const int lastRemoved = firstLine + removed - 1;
  for (const ProcInfo& proc : index.procs) {
    // Inside a continued header the edit changes what the header declares.
    const bool touchesHeader = removed > 0 ? firstLine <= proc.headerEnd && lastRemoved > proc.bodyLine
                                           : firstLine > proc.bodyLine && firstLine <= proc.headerEnd;
    if (touchesHeader) return false;
  }
  const int delta = inserted - removed;
  auto shift = [&](int& line) {
    if (line >= firstLine + removed)
      line += delta;
    else if (line >= firstLine)
      line = firstLine - 1;  // the line itself was deleted
  };
  for (ProcInfo& proc : index.procs) {
    shift(proc.bodyLine);
    shift(proc.headerEnd);
    shift(proc.endLine);
  }
  // A procedure without its End line runs up to the next header, or to the end of the module.
  for (size_t i = 0; i < index.procs.size(); ++i) {
    ProcInfo& proc = index.procs[i];
    if (m_lines[static_cast<size_t>(proc.endLine - 1)].kind == syntax::Kind::ProcEnd) continue;
    proc.endLine = i + 1 < index.procs.size() ? index.procs[i + 1].bodyLine - 1 : countOfLines();
  }
  // The Type and Enum blocks stay: they matter only in the declarations, above the edit.
  index.membersValid = false;  // their lines moved
  return true;
}

void CodeText::replaceLine(int line, QStringView text) {
  replaceLine(line, text, nullptr);
}

void CodeText::replaceLine(int line, const QString& text) {
  replaceLine(line, text, &text);
}

void CodeText::replaceLine(int line, QStringView text, const QString* shared) {
  checkLineNumber(line, countOfLines());
  // Walks replace one line at a time: that case must not pay for splitting.
  const bool severalLines =
      std::any_of(text.begin(), text.end(), [](QChar c) { return c == u'\r' || c == u'\n'; });
  const auto parts = severalLines ? splitLines(text) : std::vector<QStringView>();
  if (severalLines) {
    for (const QStringView part : parts)
      checkLength(part);
  } else {
    checkLength(text);
  }
  const size_t i = static_cast<size_t>(line - 1);
  Line& target = m_lines[i];
  const bool continuation = i > 0 && m_lines[i - 1].continues;

  if (!severalLines) {
    // Indenting changes only leading blanks, which say nothing of a line's kind: it is not read again.
    const auto afterBlanks = [](QStringView line) { return line.sliced(syntax::leadingBlanks(line).size()); };
    const bool reindented = afterBlanks(text) == afterBlanks(target.text);
    const syntax::Kind lineKind = reindented ? target.kind : syntax::kindOf(text, continuation);
    const bool continues = reindented ? target.continues : syntax::continues(text);
    // Re-indenting a directive, an End or a Type line keeps the structure: only a changed kind, a header
    // that says something else or a changed continuation moves it.
    const bool sameShape = lineKind == target.kind && continues == target.continues &&
                           (lineKind != syntax::Kind::ProcHeader ||
                            syntax::trimmedView(text) == syntax::trimmedView(target.text));
    bool structural = !sameShape && (syntax::isStructural(lineKind) || syntax::isStructural(target.kind) ||
                                     continues != target.continues);
    // Above the first header a line's kind decides where the declarations end.
    if (lineKind != target.kind && (m_firstHeaderLine == 0 || line <= m_firstHeaderLine)) structural = true;
    // A header's continuation line carries part of the header (its name, or its own continuation);
    // re-indenting it changes nothing the header declares.
    if (!structural && lineKind == syntax::Kind::Continuation &&
        text.trimmed() != QStringView(target.text).trimmed())
      structural = continuesStructural(line);
    updateMarker(line, syntax::isStructural(target.kind), syntax::isStructural(lineKind));
    target.text = shared ? *shared : text.toString();  // a QString is shared, not copied
    target.kind = lineKind;
    if (continues != target.continues) {
      target.continues = continues;
      reclassifyFrom(i + 1);
    }
    touch(line, 1, 1, structural);
    return;
  }

  // Several lines: the first replaces the line (which keeps its hidden attributes), the rest follow it.
  const LineEnd end = target.end == LineEnd::None ? newLineEnd() : target.end;
  const LineEnd lastEnd = target.end;
  updateMarker(line, syntax::isStructural(target.kind), false);
  target.text = parts.front().toString();
  target.continues = syntax::continues(target.text);
  target.kind = syntax::kindOf(target.text, continuation);
  target.end = end;
  const bool targetStructural = syntax::isStructural(target.kind);
  std::vector<Line> added;
  added.reserve(parts.size() - 1);
  bool previousContinues = target.continues;
  for (size_t k = 1; k < parts.size(); ++k) {
    added.push_back(makeLine(parts[k], previousContinues, k + 1 == parts.size() ? lastEnd : end));
    previousContinues = added.back().continues;
  }
  const int count = static_cast<int>(added.size());
  shiftMarkers(line + 1, count);
  m_lines.insert(m_lines.begin() + static_cast<std::ptrdiff_t>(i + 1), std::make_move_iterator(added.begin()),
                 std::make_move_iterator(added.end()));
  updateMarker(line, false, targetStructural);  // `target` may have moved with the insertion
  insertMarkers(line + 1, count);
  reclassifyFrom(i + 1 + added.size());
  touch(line, 1, count + 1, true);
}

void CodeText::insertLines(int line, QStringView text) {
  checkLineNumber(line, countOfLines() + 1);
  const auto parts = splitLines(text);
  for (const QStringView part : parts)
    checkLength(part);
  const size_t at = static_cast<size_t>(line - 1);
  const LineEnd end = newLineEnd();
  const bool appendingAfterUnterminated =
      at == m_lines.size() && at > 0 && m_lines[at - 1].end == LineEnd::None;

  std::vector<Line> added;
  added.reserve(parts.size());
  bool previousContinues = at > 0 && m_lines[at - 1].continues;
  for (const QStringView part : parts) {
    added.push_back(makeLine(part, previousContinues, end));
    previousContinues = added.back().continues;
  }
  if (appendingAfterUnterminated) {
    // The file ended without a line end: it still does, after the new last line.
    m_lines[at - 1].end = end;
    added.back().end = LineEnd::None;
  }
  const int count = static_cast<int>(added.size());
  const quint64 markerEdits = m_markerEdits;
  shiftMarkers(line, count);
  m_lines.insert(m_lines.begin() + static_cast<std::ptrdiff_t>(at), std::make_move_iterator(added.begin()),
                 std::make_move_iterator(added.end()));
  insertMarkers(line, count);
  reclassifyFrom(at + static_cast<size_t>(count));
  // Lines that continue a header change what it declares, and where it ends.
  touch(line, 0, count, m_markerEdits != markerEdits || continuesStructural(line));
}

void CodeText::addFromString(QStringView text) {
  insertLines(countOfLines() + 1, text);
}

void CodeText::deleteLines(int startLine, int count) {
  if (count < 0) ide::raise(ide::err::InvalidProcedureCall);
  if (count == 0) return;
  checkLineNumber(startLine, countOfLines());
  checkLineNumber(startLine + count - 1, countOfLines());
  const auto first = m_lines.begin() + static_cast<std::ptrdiff_t>(startLine - 1);
  const auto last = first + count;
  const bool removesLast = last == m_lines.end();
  const LineEnd lastEnd = std::prev(last)->end;
  for (auto it = first; it != last; ++it) {
    if (!it->attributes) continue;
    for (SourceLine& attribute : it->attributes->lines)
      m_orphanAttributes.push_back(std::move(attribute));
  }
  m_lines.erase(first, last);
  if (removesLast && !m_lines.empty() && lastEnd == LineEnd::None) m_lines.back().end = LineEnd::None;

  const quint64 markerEdits = m_markerEdits;
  const auto low = std::lower_bound(m_markers.begin(), m_markers.end(), startLine);
  const auto high = std::lower_bound(low, m_markers.end(), startLine + count);
  if (low != high) ++m_markerEdits;
  m_markers.erase(low, high);
  shiftMarkers(startLine + count, -count);
  reclassifyFrom(static_cast<size_t>(startLine - 1));
  touch(startLine, count, 0, m_markerEdits != markerEdits);
}

// ---------------------------------------------------------------------------------------------------
// Find

bool CodeText::find(QStringView target, int& startLine, int& startColumn, int& endLine, int& endColumn,
                    bool wholeWord, bool matchCase, bool patternSearch) const {
  // The IDE refuses the two options together.
  if (matchCase && patternSearch) ide::raise(ide::err::InvalidProcedureCall);
  if (startLine < 1 || startColumn < 1) ide::raise(ide::err::InvalidProcedureCall);
  const int count = countOfLines();
  const int lastLine = (endLine == -1 || endLine > count) ? count : endLine;
  if (target.isEmpty() || startLine > lastLine) return false;
  const FindMatcher matcher(target, wholeWord, matchCase, patternSearch);
  for (int n = startLine; n <= lastLine; ++n) {
    const QString& text = line(n);
    const qsizetype from = n == startLine ? startColumn - 1 : 0;
    // The end column is the last column a match may occupy.
    const qsizetype limit = (n == lastLine && endLine != -1 && endColumn != -1) ? endColumn : text.size();
    if (const auto match = matcher.findIn(text, from, limit)) {
      startLine = endLine = n;
      startColumn = static_cast<int>(match->first) + 1;
      endColumn = static_cast<int>(match->second) + 1;
      return true;
    }
  }
  return false;
}

void CodeText::addListener(Listener* listener) {
  m_listeners.push_back(listener);
}
void CodeText::removeListener(Listener* listener) {
  std::erase(m_listeners, listener);
}

}  // namespace host
