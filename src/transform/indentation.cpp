// SPDX-License-Identifier: MIT
// Indentation rules. Lines are classified by their first word and rewritten only when the layout differs,
// without building a new text for a line that is already indented.
#include "transform/indentation.h"

#include "ide/error.h"
#include "syntax/line.h"

namespace transform {

namespace {

using syntax::Kind;
using syntax::NumberPrefix;

// The number prefix of a trimmed line: `head` is written back as found, followed by one space when
// `space` is set; `code` is the trimmed rest.
struct SplitPrefix {
  QStringView head;
  bool space = false;
  QStringView code;

  qsizetype length() const { return head.size() + (space ? 1 : 0); }
};

SplitPrefix splitNumberPrefix(QStringView t) {
  const NumberPrefix prefix = syntax::numberPrefix(t);
  switch (prefix.form) {
    case NumberPrefix::Form::Colon:
      return {t.first(prefix.number.size() + 1), false, syntax::trimmedView(prefix.rest)};
    case NumberPrefix::Form::Blank:
    case NumberPrefix::Form::Comment:
      // The blanks between a number and its code or comment are indentation: keeping them in the prefix
      // would widen the number column on every run.
      return {prefix.number, true, syntax::trimmedView(prefix.rest)};
    default:
      return {{}, false, t};
  }
}

bool endsWithThen(QStringView code) {
  if (code.size() < 4 || !syntax::isKeyword(code.last(4), u"Then")) return false;
  return code.size() == 4 || syntax::isBlank(code[code.size() - 5]);
}

// What a line does to the levels.
enum class Action {
  Ordinary,
  ProcedureEnd,
  If,
  ElseIf,
  Else,
  Open,
  OpenSelect,
  EndSelect,
  Case,
  Close,
};

Action actionOf(Kind kind) {
  switch (kind) {
    case Kind::ProcEnd:
      return Action::ProcedureEnd;
    case Kind::If:
    case Kind::DirectiveIf:
      return Action::If;
    case Kind::ElseIf:
    case Kind::DirectiveElseIf:
      return Action::ElseIf;
    case Kind::Else:
    case Kind::DirectiveElse:
      return Action::Else;
    case Kind::With:
    case Kind::While:
    case Kind::For:
    case Kind::Do:
      return Action::Open;
    case Kind::SelectCase:
      return Action::OpenSelect;
    case Kind::EndSelect:
      return Action::EndSelect;
    case Kind::Case:
      return Action::Case;
    case Kind::EndIf:
    case Kind::EndWith:
    case Kind::Wend:
    case Kind::Next:
    case Kind::Loop:
    case Kind::DirectiveEndIf:
      return Action::Close;
    default:
      return Action::Ordinary;
  }
}

// In the declarations only Type and Enum blocks and directives change levels. Inside a Type or Enum block
// every line up to its End is a member, whatever its name ("Type As Byte").
Action classifyDeclaration(QStringView t, bool& inTypeBlock) {
  const Kind kind = syntax::classify(t).kind;
  if (syntax::isDirective(kind)) return actionOf(kind);
  if (kind == Kind::TypeEnd || kind == Kind::EnumEnd) {
    inTypeBlock = false;
    return Action::Close;
  }
  if (inTypeBlock) return Action::Ordinary;
  if (kind == Kind::TypeBegin || kind == Kind::EnumBegin) {
    inTypeBlock = true;
    return Action::Open;
  }
  return Action::Ordinary;
}

}  // namespace

bool IsBlockIf(QStringView trimmed) {
  return syntax::continues(trimmed) || endsWithThen(syntax::codePart(trimmed));
}

bool IfEndsSingleLine(QStringView trimmed) {
  // A line that is itself continued does not end the header yet.
  if (syntax::continues(trimmed)) return false;
  return !endsWithThen(syntax::codePart(trimmed));
}

qsizetype numberPrefixLength(QStringView line) {
  const QStringView t = syntax::trimmedView(line);
  return t.isEmpty() ? 0 : splitNumberPrefix(t).length();
}

Indenter::Indenter(IndentMode mode, qint32 spaces)
    : m_mode(mode), m_unit(mode == IndentMode::Spaces ? spaces : 1) {
  if (m_unit < 1) ide::raise(ide::err::InvalidProcedureCall);
  beginProcedure();
}

void Indenter::beginProcedure(const QString& numberColumn) {
  m_current = CIndenter{0, m_unit};
  m_stack.clear();
  // A header left open by broken code must not leak into the next procedure.
  m_ifContinued = false;
  m_caseContinued = false;
  m_lineContinues = false;
  m_numberColumn = numberColumn;
}

void Indenter::beginDeclarations() {
  m_current = CIndenter{0, 0};
  m_stack.clear();
  m_ifContinued = false;
  m_caseContinued = false;
  m_lineContinues = false;
  m_inTypeBlock = false;
  m_numberColumn.clear();
}

bool Indenter::IndentLine(QString& line, bool& statementContinued) {
  return indent(line, statementContinued, false);
}

bool Indenter::IndentDeclarationLine(QString& line, bool& statementContinued) {
  return indent(line, statementContinued, true);
}

void Indenter::PopBlock(qint32 mask) {
  while (!m_stack.empty()) {
    const bool matches = (m_stack.back().iType & mask) != 0;
    m_stack.pop_back();
    m_current.Indentation = std::max(0, m_current.Indentation - m_unit);
    if (matches) break;
  }
}

bool Indenter::indent(QString& line, bool& statementContinued, bool declaration) {
  const QStringView t = syntax::trimmedView(line);
  if (t.isEmpty()) {
    // A blank line is the last line of a statement continued onto it: the next line starts a new one (and
    // may carry a line number), as numbering and the code index read it.
    if (statementContinued || m_lineContinues) {
      m_lineContinues = false;
      if (m_ifContinued) {
        m_ifContinued = false;  // "If x Then _" and nothing more: a block If, whose level stays
      } else if (m_caseContinued) {
        m_caseContinued = false;
      } else if (statementContinued) {
        statementContinued = false;
        PopBlock(IT_RELATIVE);
      }
    }
    return false;
  }

  Layout layout;
  Action action;
  if (declaration) {
    layout.code = t;
    action = classifyDeclaration(t, m_inTypeBlock);
  } else {
    const bool continuationLine = statementContinued || m_lineContinues;
    const SplitPrefix prefix = continuationLine ? SplitPrefix{{}, false, t} : splitNumberPrefix(t);
    const qsizetype column = m_numberColumn.size();
    layout.head = prefix.head;
    layout.code = prefix.code;
    layout.spaces = prefix.head.isEmpty()
                        ? column
                        : (prefix.space ? 1 : 0) + std::max<qsizetype>(0, column - prefix.length());
    action = continuationLine ? Action::Ordinary : actionOf(syntax::classify(prefix.code).kind);
  }
  const bool continues = syntax::continues(t);
  m_lineContinues = continues;

  bool changed = false;
  switch (action) {
    case Action::ProcedureEnd:
      m_stack.clear();
      m_current = CIndenter{0, m_unit};
      break;
    case Action::If:
    case Action::ElseIf:
      if (action == Action::ElseIf) {
        PopBlock(IT_ABSOLUTE);
        m_ifContinued = continues;
      } else if (continues) {
        m_ifContinued = true;
      }
      m_current.iType = IT_ABSOLUTE;
      changed = IsBlockIf(layout.code) ? opener(line, layout, statementContinued)
                                       : ordinary(line, layout, statementContinued);
      break;
    case Action::Else:
      PopBlock(IT_ABSOLUTE);
      changed = opener(line, layout, statementContinued);
      break;
    case Action::Open:
      changed = opener(line, layout, statementContinued);
      break;
    case Action::OpenSelect:
      // Case lines sit one unit inside the Select, their bodies two.
      changed = opener(line, layout, statementContinued, 2);
      break;
    case Action::Case:
      PopBlock(IT_ABSOLUTE);
      m_current.iType = IT_ABSOLUTE;
      m_caseContinued = continues;
      changed = opener(line, layout, statementContinued);
      break;
    case Action::EndSelect:
      // The Select's second unit has no level of its own.
      PopBlock(IT_ABSOLUTE);
      if (m_current.Indentation > m_unit) m_current.Indentation -= m_unit;
      statementContinued = false;
      changed = write(line, layout);
      break;
    case Action::Close:
      PopBlock(IT_ABSOLUTE);
      statementContinued = false;
      changed = write(line, layout);
      break;
    case Action::Ordinary:
      changed = ordinary(line, layout, statementContinued);
      break;
  }
  // The type only labels the level pushed while handling a line; it never carries over to the next one.
  m_current.iType = 0;
  return changed;
}

bool Indenter::opener(QString& line, const Layout& layout, bool& statementContinued, qint32 units) {
  m_current.iType = IT_ABSOLUTE;
  const bool changed = write(line, layout);
  m_current.Indentation += units * m_unit;
  m_stack.push_back(m_current.Copy());
  statementContinued = false;
  return changed;
}

bool Indenter::ordinary(QString& line, const Layout& layout, bool& statementContinued) {
  const bool continues = syntax::continues(layout.code);
  bool previous = false;
  if (!m_ifContinued && !m_caseContinued) {
    previous = statementContinued;
    statementContinued = continues;
  }
  const bool changed = write(line, layout);
  if (m_ifContinued) {
    if (!continues) {
      m_ifContinued = false;
      // The If turned out to be single-line: close the level opened for it.
      if (IfEndsSingleLine(layout.code)) PopBlock(IT_ABSOLUTE);
    }
  } else if (m_caseContinued) {
    if (!continues) m_caseContinued = false;
  } else if (statementContinued && !previous) {
    // First line of a continued statement: its continuation lines go one unit deeper.
    m_current.iType = IT_RELATIVE;
    m_current.Indentation += m_unit;
    m_stack.push_back(m_current.Copy());
  } else if (previous && !statementContinued) {
    PopBlock(IT_RELATIVE);
  }
  return changed;
}

bool Indenter::write(QString& line, const Layout& layout) const {
  const QChar fill = m_mode == IndentMode::Spaces ? u' ' : u'\t';
  const qsizetype depth = std::max(0, m_current.Indentation);
  const qsizetype codeAt = layout.head.size() + layout.spaces + depth;
  const qsizetype total = codeAt + layout.code.size();

  const QStringView old(line);
  if (old.size() == total && old.startsWith(layout.head) && old.sliced(codeAt) == layout.code) {
    const auto isSpace = [](QChar c) { return c == u' '; };
    const auto isFill = [fill](QChar c) { return c == fill; };
    const QStringView pad = old.sliced(layout.head.size(), layout.spaces);
    const QStringView indentation = old.sliced(layout.head.size() + layout.spaces, depth);
    if (std::all_of(pad.begin(), pad.end(), isSpace) &&
        std::all_of(indentation.begin(), indentation.end(), isFill)) {
      return false;
    }
  }

  QString out;
  out.reserve(total);
  out.append(layout.head);
  out.resize(layout.head.size() + layout.spaces, u' ');
  out.resize(codeAt, fill);
  out.append(layout.code);
  line = std::move(out);
  return true;
}

}  // namespace transform
