// SPDX-License-Identifier: MIT
// Indentation rules. Lines are classified by their first word and rewritten only when the layout differs,
// without building a new text for a line that is already indented.
#include "transform/indentation.h"

#include "ide/error.h"

namespace transform {

namespace {

// The number prefix of a trimmed line: `head` is written back as found, followed by one space when
// `space` is set; `code` is the trimmed rest.
struct NumberPrefix {
  QStringView head;
  bool space = false;
  QStringView code;

  qsizetype length() const { return head.size() + (space ? 1 : 0); }
};

NumberPrefix splitNumberPrefix(QStringView t) {
  if (!mayBeginNumber(t)) return {{}, false, t};
  const qsizetype colon = t.indexOf(u':');
  if (colon > 0 && isUsableNumber(t.first(colon)))
    return {t.first(colon + 1), false, trimmedView(t.sliced(colon + 1))};
  // The blanks between a number and its comment are indentation: keeping them in the prefix would widen
  // the number column on every run.
  const qsizetype quote = t.indexOf(u'\'');
  if (quote > 0 && isUsableNumber(t.first(quote)))
    return {rightTrimmedView(t.first(quote)), true, t.sliced(quote)};
  const qsizetype blank = indexOfBlank(t);
  if (blank > 0 && isUsableNumber(t.first(blank)))
    return {t.first(blank), true, trimmedView(t.sliced(blank + 1))};
  return {{}, false, t};
}

// The statement part of a trimmed line: the text before its comment mark, without trailing blanks. Quotes
// toggle string literals; a doubled quote inside a literal toggles twice and so stays inside.
QStringView codePart(QStringView t) {
  bool inString = false;
  for (qsizetype i = 0; i < t.size(); ++i) {
    if (t[i] == u'"') {
      inString = !inString;
    } else if (t[i] == u'\'' && !inString) {
      return rightTrimmedView(t.first(i));
    }
  }
  return rightTrimmedView(t);
}

bool endsWithThen(QStringView code) {
  if (!code.endsWith(u"Then")) return false;
  return code.size() == 4 || isBlank(code[code.size() - 5]);
}

// `keyword` alone, or followed by a blank or a comment: "Next i" and "Loop ' x" but not "Nextx = 1".
bool isWord(QStringView t, QStringView keyword) {
  if (!t.startsWith(keyword)) return false;
  if (t.size() == keyword.size()) return true;
  const QChar next = t[keyword.size()];
  return isBlank(next) || next == u'\'';
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

Action classifyDirective(QStringView t) {
  if (t.startsWith(u"#If ")) return Action::If;
  if (t.startsWith(u"#End If")) return Action::Close;
  if (t.startsWith(u"#ElseIf ")) return Action::ElseIf;
  if (isWord(t, u"#Else")) return Action::Else;
  return Action::Ordinary;
}

Action classifyBodyLine(QStringView t) {
  if (t.isEmpty()) return Action::Ordinary;
  switch (t.front().unicode()) {
    case u'E':
      if (isProcedureEnd(t)) return Action::ProcedureEnd;
      if (t.startsWith(u"End If") || t.startsWith(u"End With")) return Action::Close;
      if (t.startsWith(u"End Select")) return Action::EndSelect;
      if (t.startsWith(u"ElseIf ")) return Action::ElseIf;
      if (isWord(t, u"Else")) return Action::Else;
      break;
    case u'I':
      if (t.startsWith(u"If ")) return Action::If;
      break;
    case u'S':
      if (t.startsWith(u"Select Case ")) return Action::OpenSelect;
      break;
    case u'C':
      if (t.startsWith(u"Case ")) return Action::Case;
      break;
    case u'W':
      if (t.startsWith(u"With ") || t.startsWith(u"While ")) return Action::Open;
      if (isWord(t, u"Wend")) return Action::Close;
      break;
    case u'F':
      if (t.startsWith(u"For ")) return Action::Open;
      break;
    case u'N':
      if (isWord(t, u"Next")) return Action::Close;
      break;
    case u'D':
      // DoEvents and other names that begin with Do are ordinary calls.
      if (isWord(t, u"Do")) return Action::Open;
      break;
    case u'L':
      if (isWord(t, u"Loop")) return Action::Close;
      break;
    case u'#':
      return classifyDirective(t);
  }
  return Action::Ordinary;
}

// Inside a Type or Enum block every line up to its End is a member, whatever its name ("Type As Byte").
Action classifyDeclaration(QStringView t, bool& inTypeBlock) {
  if (t.startsWith(u'#')) return classifyDirective(t);
  if (t.startsWith(u"End Type") || t.startsWith(u"End Enum")) {
    inTypeBlock = false;
    return Action::Close;
  }
  if (inTypeBlock) return Action::Ordinary;
  static constexpr QStringView kOpeners[] = {
      u"Type ", u"Enum ", u"Public Type ", u"Public Enum ", u"Private Type ", u"Private Enum ",
  };
  for (QStringView opener : kOpeners) {
    if (t.startsWith(opener)) {
      inTypeBlock = true;
      return Action::Open;
    }
  }
  return Action::Ordinary;
}

}  // namespace

bool IsBlockIf(QStringView trimmed) {
  return endsWithContinuation(trimmed) || endsWithThen(codePart(trimmed));
}

bool IfEndsSingleLine(QStringView trimmed) {
  // A line that is itself continued does not end the header yet.
  if (endsWithContinuation(trimmed)) return false;
  return !endsWithThen(codePart(trimmed));
}

qsizetype numberPrefixLength(QStringView line) {
  const QStringView t = trimmedView(line);
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
  const QStringView t = trimmedView(line);
  if (t.isEmpty()) return false;

  Layout layout;
  Action action;
  if (declaration) {
    layout.code = t;
    action = classifyDeclaration(t, m_inTypeBlock);
  } else {
    const bool continuationLine = statementContinued || m_lineContinues;
    const NumberPrefix prefix = continuationLine ? NumberPrefix{{}, false, t} : splitNumberPrefix(t);
    const qsizetype column = m_numberColumn.size();
    layout.head = prefix.head;
    layout.code = prefix.code;
    layout.spaces = prefix.head.isEmpty()
                        ? column
                        : (prefix.space ? 1 : 0) + std::max<qsizetype>(0, column - prefix.length());
    action = classifyBodyLine(prefix.code);
  }
  const bool continues = endsWithContinuation(t);
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
  const bool continues = endsWithContinuation(layout.code);
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
