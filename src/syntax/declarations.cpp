// SPDX-License-Identifier: MIT
#include "syntax/declarations.h"

#include "syntax/line.h"

namespace syntax {
namespace {

bool is(QStringView word, QStringView keyword) {
  return isKeyword(word, keyword);
}

/// Walks a statement word by word.
class Scanner {
 public:
  explicit Scanner(QStringView text) : m_text(text) {}

  /// The next identifier-like word (empty when the next character does not start one).
  QStringView word() {
    m_pos = skipBlanks(m_text, m_pos);
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
    if (is(w, u"Public")) {
      mods.isPublic = true;
    } else if (is(w, u"Private")) {
      mods.isPrivate = true;
    } else if (is(w, u"Friend")) {
      mods.isFriend = true;
    } else if (is(w, u"Global")) {
      mods.isGlobal = true;
    } else if (is(w, u"Static")) {
      mods.isStatic = true;
    } else if (is(w, u"Dim")) {
      mods.isDim = true;
    } else {
      return w;
    }
  }
}

bool namesSomething(QStringView word) {
  return !word.isEmpty() && !is(word, u"As");
}

bool isProcKeyword(QStringView w) {
  return is(w, u"Sub") || is(w, u"Function") || is(w, u"Property");
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

std::optional<ProcHeader> parseProcHeader(QStringView statement) {
  Scanner scanner(statement);
  Modifiers mods;
  const QStringView keyword = readModifiers(scanner, mods);
  ProcHeader header;
  if (is(keyword, u"Sub")) {
    header.kind = ide::ProcKind::Proc;
  } else if (is(keyword, u"Function")) {
    header.kind = ide::ProcKind::Proc;
    header.isFunction = true;
  } else if (is(keyword, u"Property")) {
    const QStringView accessor = scanner.word();
    if (is(accessor, u"Get"))
      header.kind = ide::ProcKind::Get;
    else if (is(accessor, u"Let"))
      header.kind = ide::ProcKind::Let;
    else if (is(accessor, u"Set"))
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
  const QStringView text = codePart(statement);
  Scanner scanner(text);
  Modifiers mods;
  QStringView w = readModifiers(scanner, mods);
  Declaration decl;
  decl.isStatic = mods.isStatic;

  if (is(w, u"Declare")) {
    const QStringView kind = scanner.word();
    if (!is(kind, u"Sub") && !is(kind, u"Function")) return std::nullopt;
    const QStringView name = scanner.word();
    if (name.isEmpty()) return std::nullopt;
    decl.type = ide::MemberType::Method;
    decl.scope = scopeOf(mods, ide::Scope::Public);
    decl.names.push_back(name.toString());
    return decl;
  }
  if (is(w, u"Event")) {
    const QStringView name = scanner.word();
    if (name.isEmpty()) return std::nullopt;
    decl.type = ide::MemberType::Event;
    decl.scope = scopeOf(mods, ide::Scope::Public);
    decl.names.push_back(name.toString());
    return decl;
  }
  if (is(w, u"Const")) {
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
  if ((isProcKeyword(w) || is(w, u"Type") || is(w, u"Enum")) && namesSomething(scanner.word()))
    return std::nullopt;

  // A variable list: the word already read starts the first declarator.
  decl.type = ide::MemberType::Variable;
  decl.scope = scopeOf(mods, ide::Scope::Private);
  for (const QStringView part : splitTopLevel(text.sliced(firstDeclarator))) {
    Scanner declarator(part);
    QStringView name = declarator.word();
    if (is(name, u"WithEvents")) name = declarator.word();
    if (!name.isEmpty()) decl.names.push_back(name.toString());
  }
  return decl.names.empty() ? std::nullopt : std::optional(decl);
}

}  // namespace syntax
