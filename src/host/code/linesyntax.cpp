// SPDX-License-Identifier: MIT
#include "host/code/linesyntax.h"
#include "host/files/blanks.h"

namespace host {
namespace {

bool is(QStringView word, QLatin1StringView keyword) {
  return word.compare(keyword, Qt::CaseInsensitive) == 0;
}

/// Walks a statement word by word.
class Scanner {
 public:
  explicit Scanner(QStringView text) : m_text(text) {}

  void skipBlanks() {
    while (m_pos < m_text.size() && isBlank(m_text[m_pos]))
      ++m_pos;
  }
  /// The next identifier-like word (empty when the next character does not start one).
  QStringView word() {
    skipBlanks();
    m_wordStart = m_pos;
    while (m_pos < m_text.size() && isIdentifierChar(m_text[m_pos]))
      ++m_pos;
    return m_text.sliced(m_wordStart, m_pos - m_wordStart);
  }
  /// Where the word last read began.
  qsizetype lastWordStart() const { return m_wordStart; }
  QStringView rest() const { return m_text.sliced(m_pos); }

 private:
  QStringView m_text;
  qsizetype m_pos = 0;
  qsizetype m_wordStart = 0;
};

struct Modifiers {
  bool isPublic = false;
  bool isPrivate = false;
  bool isFriend = false;
  bool isGlobal = false;
  bool isStatic = false;
  bool isDim = false;
  bool any() const { return isPublic || isPrivate || isFriend || isGlobal || isStatic || isDim; }
};

/// Consumes the leading scope and storage words; returns the first word after them.
QStringView readModifiers(Scanner& scanner, Modifiers& mods) {
  for (;;) {
    const QStringView w = scanner.word();
    if (is(w, QLatin1StringView("Public"))) {
      mods.isPublic = true;
    } else if (is(w, QLatin1StringView("Private"))) {
      mods.isPrivate = true;
    } else if (is(w, QLatin1StringView("Friend"))) {
      mods.isFriend = true;
    } else if (is(w, QLatin1StringView("Global"))) {
      mods.isGlobal = true;
    } else if (is(w, QLatin1StringView("Static"))) {
      mods.isStatic = true;
    } else if (is(w, QLatin1StringView("Dim"))) {
      mods.isDim = true;
    } else {
      return w;
    }
  }
}

/// A statement that declares something names it right after its keyword: "Sub As Long" or "Type = 2" is a
/// Type or Enum member whose name only looks like a keyword. A lone "_" carries the name to the next line.
bool namesSomething(QStringView word) {
  return !word.isEmpty() && !is(word, QLatin1StringView("As"));
}

bool isProcKeyword(QStringView w) {
  return is(w, QLatin1StringView("Sub")) || is(w, QLatin1StringView("Function")) ||
         is(w, QLatin1StringView("Property"));
}

/// Cuts a trailing comment: the first apostrophe outside a string literal.
QStringView withoutComment(QStringView text) {
  bool inString = false;
  for (qsizetype i = 0; i < text.size(); ++i) {
    const QChar c = text[i];
    if (c == u'"') inString = !inString;
    if (c == u'\'' && !inString) return text.first(i);
  }
  return text;
}

/// Splits at commas that are outside parentheses and string literals.
std::vector<QStringView> splitTopLevel(QStringView text) {
  std::vector<QStringView> parts;
  int depth = 0;
  bool inString = false;
  qsizetype start = 0;
  for (qsizetype i = 0; i < text.size(); ++i) {
    const QChar c = text[i];
    if (c == u'"') inString = !inString;
    if (inString) continue;
    if (c == u'(') ++depth;
    if (c == u')' && depth > 0) --depth;
    if (c == u',' && depth == 0) {
      parts.push_back(text.sliced(start, i - start));
      start = i + 1;
    }
  }
  parts.push_back(text.sliced(start));
  return parts;
}

ide::Scope scopeOf(const Modifiers& mods, ide::Scope fallback) {
  if (mods.isPublic || mods.isGlobal) return ide::Scope::Public;
  if (mods.isPrivate || mods.isDim) return ide::Scope::Private;
  if (mods.isFriend) return ide::Scope::Friend;
  return fallback;
}

}  // namespace

LineClass classifyStatement(QStringView line) {
  qsizetype i = 0;
  while (i < line.size() && isBlank(line[i]))
    ++i;
  if (i == line.size()) return LineClass::Blank;
  const QChar first = line[i];
  if (first == u'\'') return LineClass::Comment;
  // Most statements start with a word no declaration starts with: leave them early.
  switch (first.toUpper().unicode()) {
    case u'C':
    case u'D':
    case u'E':
    case u'F':
    case u'G':
    case u'P':
    case u'R':
    case u'S':
    case u'T':
    case u'W':
      break;
    default:
      return LineClass::Code;
  }

  Scanner scanner(line.sliced(i));
  Modifiers mods;
  const QStringView w = readModifiers(scanner, mods);
  if (!mods.any()) {
    if (is(w, QLatin1StringView("Rem"))) {
      const QChar next = scanner.rest().isEmpty() ? QChar(u' ') : scanner.rest().front();
      return isBlank(next) ? LineClass::Comment : LineClass::Code;
    }
    if (is(w, QLatin1StringView("End"))) {
      const QStringView what = scanner.word();
      if (isProcKeyword(what)) return LineClass::ProcEnd;
      if (is(what, QLatin1StringView("Type"))) return LineClass::TypeEnd;
      if (is(what, QLatin1StringView("Enum"))) return LineClass::EnumEnd;
      return LineClass::Code;
    }
  }
  // A keyword begins a procedure or a block only when the statement goes on with a name: the letter case
  // of the keyword decides nothing.
  const LineClass notDeclaring = mods.any() ? LineClass::Variable : LineClass::Code;
  if (is(w, QLatin1StringView("Sub")) || is(w, QLatin1StringView("Function")))
    return namesSomething(scanner.word()) ? LineClass::ProcHeader : notDeclaring;
  if (is(w, QLatin1StringView("Property"))) {
    const QStringView accessor = scanner.word();
    if (is(accessor, QLatin1StringView("Get")) || is(accessor, QLatin1StringView("Let")) ||
        is(accessor, QLatin1StringView("Set")))
      return namesSomething(scanner.word()) ? LineClass::ProcHeader : notDeclaring;
    return notDeclaring;
  }
  if (is(w, QLatin1StringView("Declare"))) return LineClass::Declare;
  if (is(w, QLatin1StringView("Event"))) return LineClass::Event;
  if (is(w, QLatin1StringView("Const"))) return LineClass::Const;
  if ((is(w, QLatin1StringView("Type")) || is(w, QLatin1StringView("Enum"))) && !mods.isDim &&
      !mods.isStatic) {
    const bool isType = is(w, QLatin1StringView("Type"));
    if (namesSomething(scanner.word())) return isType ? LineClass::TypeBegin : LineClass::EnumBegin;
    return notDeclaring;
  }
  if (mods.any() && !w.isEmpty()) return LineClass::Variable;
  return LineClass::Code;
}

bool continuesOnNextLine(QStringView line) {
  qsizetype end = line.size();
  while (end > 0 && isBlank(line[end - 1]))
    --end;
  return end >= 2 && line[end - 1] == u'_' && isBlank(line[end - 2]);
}

QString joinContinuedLines(const std::vector<QStringView>& lines) {
  QString joined;
  for (const QStringView line : lines) {
    QStringView part = line;
    if (continuesOnNextLine(part)) {
      qsizetype end = part.size();
      while (end > 0 && isBlank(part[end - 1]))
        --end;
      part = part.first(end - 1);  // drop the underscore, keep the blank before it
    }
    joined += part;
  }
  return joined;
}

std::optional<ProcHeader> parseProcHeader(QStringView statement) {
  Scanner scanner(statement);
  Modifiers mods;
  const QStringView keyword = readModifiers(scanner, mods);
  ProcHeader header;
  if (is(keyword, QLatin1StringView("Sub"))) {
    header.kind = ide::ProcKind::Proc;
  } else if (is(keyword, QLatin1StringView("Function"))) {
    header.kind = ide::ProcKind::Proc;
    header.isFunction = true;
  } else if (is(keyword, QLatin1StringView("Property"))) {
    const QStringView accessor = scanner.word();
    if (is(accessor, QLatin1StringView("Get")))
      header.kind = ide::ProcKind::Get;
    else if (is(accessor, QLatin1StringView("Let")))
      header.kind = ide::ProcKind::Let;
    else if (is(accessor, QLatin1StringView("Set")))
      header.kind = ide::ProcKind::Set;
    else
      return std::nullopt;
  } else {
    return std::nullopt;
  }
  const QStringView name = scanner.word();
  if (!namesSomething(name)) return std::nullopt;
  header.name = name.toString();
  header.scope = scopeOf(mods, ide::Scope::Public);
  header.isStatic = mods.isStatic;
  return header;
}

std::optional<Declaration> parseDeclaration(QStringView statement) {
  const QStringView text = withoutComment(statement);
  Scanner scanner(text);
  Modifiers mods;
  QStringView w = readModifiers(scanner, mods);
  Declaration decl;
  decl.isStatic = mods.isStatic;

  if (is(w, QLatin1StringView("Declare"))) {
    const QStringView kind = scanner.word();
    if (!is(kind, QLatin1StringView("Sub")) && !is(kind, QLatin1StringView("Function"))) return std::nullopt;
    const QStringView name = scanner.word();
    if (name.isEmpty()) return std::nullopt;
    decl.type = ide::MemberType::Method;
    decl.scope = scopeOf(mods, ide::Scope::Public);
    decl.names.push_back(name.toString());
    return decl;
  }
  if (is(w, QLatin1StringView("Event"))) {
    const QStringView name = scanner.word();
    if (name.isEmpty()) return std::nullopt;
    decl.type = ide::MemberType::Event;
    decl.scope = scopeOf(mods, ide::Scope::Public);
    decl.names.push_back(name.toString());
    return decl;
  }
  if (is(w, QLatin1StringView("Const"))) {
    decl.type = ide::MemberType::Const;
    decl.scope = scopeOf(mods, ide::Scope::Private);
    for (const QStringView part : splitTopLevel(scanner.rest())) {
      const QStringView name = Scanner(part).word();
      if (!name.isEmpty()) decl.names.push_back(name.toString());
    }
    return decl.names.empty() ? std::nullopt : std::optional(decl);
  }
  if (!mods.any()) return std::nullopt;
  const qsizetype firstDeclarator = scanner.lastWordStart();
  // "Private Sub As Long" declares a variable named like a keyword; "Private Sub Main" is no variable.
  if ((isProcKeyword(w) || is(w, QLatin1StringView("Type")) || is(w, QLatin1StringView("Enum"))) &&
      namesSomething(scanner.word()))
    return std::nullopt;

  // A variable list: the word already read starts the first declarator.
  decl.type = ide::MemberType::Variable;
  decl.scope = scopeOf(mods, ide::Scope::Private);
  for (const QStringView part : splitTopLevel(text.sliced(firstDeclarator))) {
    Scanner declarator(part);
    QStringView name = declarator.word();
    if (is(name, QLatin1StringView("WithEvents"))) name = declarator.word();
    if (!name.isEmpty()) decl.names.push_back(name.toString());
  }
  return decl.names.empty() ? std::nullopt : std::optional(decl);
}

}  // namespace host
