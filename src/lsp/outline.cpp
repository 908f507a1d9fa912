// SPDX-License-Identifier: MIT
#include "lsp/outline.h"

#include "syntax/declarations.h"
#include "syntax/line.h"
#include "transform/indentation.h"

#include <optional>

namespace lsp {

namespace {

using syntax::Kind;

QString procDetail(const syntax::ProcHeader& header) {
  QString scope;
  switch (header.scope) {
    case ide::Scope::Private:
      scope = QStringLiteral("Private ");
      break;
    case ide::Scope::Friend:
      scope = QStringLiteral("Friend ");
      break;
    default:
      scope = QStringLiteral("Public ");
  }
  switch (header.kind) {
    case ide::ProcKind::Get:
      return scope + QStringLiteral("Property Get");
    case ide::ProcKind::Let:
      return scope + QStringLiteral("Property Let");
    case ide::ProcKind::Set:
      return scope + QStringLiteral("Property Set");
    default:
      return scope + (header.isFunction ? QStringLiteral("Function") : QStringLiteral("Sub"));
  }
}

/// The words a block opens and closes with, for messages.
QString blockName(Kind kind) {
  switch (kind) {
    case Kind::If:
      return QStringLiteral("If");
    case Kind::SelectCase:
      return QStringLiteral("Select Case");
    case Kind::With:
      return QStringLiteral("With");
    case Kind::For:
      return QStringLiteral("For");
    case Kind::Do:
      return QStringLiteral("Do");
    case Kind::While:
      return QStringLiteral("While");
    case Kind::TypeBegin:
      return QStringLiteral("Type");
    case Kind::EnumBegin:
      return QStringLiteral("Enum");
    case Kind::DirectiveIf:
      return QStringLiteral("#If");
    case Kind::EndIf:
      return QStringLiteral("End If");
    case Kind::EndSelect:
      return QStringLiteral("End Select");
    case Kind::EndWith:
      return QStringLiteral("End With");
    case Kind::Next:
      return QStringLiteral("Next");
    case Kind::Loop:
      return QStringLiteral("Loop");
    case Kind::Wend:
      return QStringLiteral("Wend");
    case Kind::TypeEnd:
      return QStringLiteral("End Type");
    case Kind::EnumEnd:
      return QStringLiteral("End Enum");
    case Kind::DirectiveEndIf:
      return QStringLiteral("#End If");
    case Kind::ProcEnd:
      return QStringLiteral("End");
    default:
      return {};
  }
}

/// The opener a closer ends.
Kind openerOf(Kind closer) {
  switch (closer) {
    case Kind::EndIf:
      return Kind::If;
    case Kind::EndSelect:
      return Kind::SelectCase;
    case Kind::EndWith:
      return Kind::With;
    case Kind::Next:
      return Kind::For;
    case Kind::Loop:
      return Kind::Do;
    case Kind::Wend:
      return Kind::While;
    default:
      return Kind::Blank;
  }
}

/// The first word of a statement (a Type or Enum member's name), or the word after the keywords.
std::optional<syntax::Token> wordAfter(QStringView text, int skipWords) {
  syntax::Tokenizer tokens(text);
  syntax::Token token;
  while (tokens.next(token)) {
    if (token.type != syntax::Token::Type::Word) return std::nullopt;
    if (skipWords-- == 0) return token;
  }
  return std::nullopt;
}

/// Where `name` stands on `line` as a word of its own (not inside "Public" for a name "Pub"); -1 if not.
qsizetype wordColumn(QStringView line, QStringView name) {
  syntax::Tokenizer tokens(line);
  syntax::Token token;
  while (tokens.next(token))
    if (token.type == syntax::Token::Type::Word &&
        line.mid(token.start, token.length).compare(name, Qt::CaseInsensitive) == 0)
      return token.start;
  return -1;
}

struct Open {
  Kind kind;
  int line;
  int column;
  int length;
};

class Reader {
 public:
  explicit Reader(const std::vector<QStringView>& lines) : m_lines(lines) {}

  void statement(int first, int last, QStringView firstLine, QStringView joined);
  Outline finish();

 private:
  void problem(const Open& at, const QString& message) {
    m_outline.imbalances.push_back({at.line, at.column, at.length, message});
  }
  void unclosed(const Open& open) {
    problem(open, QStringLiteral("%1 is never closed: indentation cannot tell where its block ends")
                      .arg(blockName(open.kind)));
  }
  void closeBlocks(std::vector<Open>& stack) {
    for (const Open& open : stack)
      unclosed(open);
    stack.clear();
  }
  void close(std::vector<Open>& stack, Kind opener, const Open& closer);
  void endProcedure(int line);

  const std::vector<QStringView>& m_lines;
  Outline m_outline;
  std::optional<Symbol> m_procedure;
  std::optional<Open> m_procedureOpen;
  bool m_bodyStarted = false;  // a statement of the open procedure's body came
  std::optional<Symbol> m_typeOrEnum;
  std::vector<Open> m_blocks;
  std::vector<Open> m_directives;
};

void Reader::close(std::vector<Open>& stack, Kind opener, const Open& closer) {
  for (size_t i = stack.size(); i-- > 0;) {
    if (stack[i].kind != opener) continue;
    for (size_t j = i + 1; j < stack.size(); ++j)
      unclosed(stack[j]);
    if (closer.line > stack[i].line) m_outline.folds.push_back({stack[i].line, closer.line - 1});
    stack.resize(i);
    return;
  }
  problem(closer, QStringLiteral("%1 closes no block: indentation cannot tell which level ends here")
                      .arg(blockName(closer.kind)));
}

void Reader::endProcedure(int line) {
  closeBlocks(m_blocks);
  m_procedure->endLine = line;
  if (line > m_procedure->line) m_outline.folds.push_back({m_procedure->line, line - 1});
  m_outline.symbols.push_back(std::move(*m_procedure));
  m_procedure.reset();
}

void Reader::statement(int first, int last, QStringView firstLine, QStringView joined) {
  qsizetype indent = 0;
  while (indent < firstLine.size() && firstLine[indent].isSpace())
    ++indent;
  QStringView text = joined.trimmed();
  // A line number in front of a statement is no part of it.
  if (const syntax::NumberPrefix prefix = syntax::numberPrefix(text)) {
    if (prefix.form != syntax::NumberPrefix::Form::Colon && prefix.form != syntax::NumberPrefix::Form::Blank)
      return;
    text = prefix.rest.trimmed();
  }
  const Kind kind = syntax::classify(text).kind;
  if (kind == Kind::Blank || kind == Kind::Comment || kind == Kind::Attribute) return;
  const QStringView shown = firstLine.trimmed();
  const Open here{kind, first, int(indent), int(shown.size())};

  switch (kind) {
    case Kind::DirectiveIf:
      m_directives.push_back(here);
      return;
    case Kind::DirectiveEndIf:
      close(m_directives, Kind::DirectiveIf, here);
      return;
    case Kind::ProcHeader: {
      const auto header = syntax::parseProcHeader(text);
      if (!header) return;
      // Another header before the body (#If ... #Else around the header): the same procedure.
      if (m_procedure && !m_bodyStarted) return;
      if (m_procedure) {
        problem(*m_procedureOpen,
                QStringLiteral("%1 has no End before the next procedure: indentation cannot "
                               "tell where it ends")
                    .arg(m_procedure->name));
        endProcedure(first - 1);
      }
      if (m_typeOrEnum) {
        unclosed({m_typeOrEnum->kind == SymbolKind::Struct ? Kind::TypeBegin : Kind::EnumBegin,
                  m_typeOrEnum->line, 0, 0});
        m_typeOrEnum.reset();
      }
      Symbol symbol;
      symbol.name = header->name;
      symbol.detail = procDetail(*header);
      symbol.kind = header->kind == ide::ProcKind::Proc ? SymbolKind::Function : SymbolKind::Property;
      symbol.line = first;
      const qsizetype at = wordColumn(firstLine, header->name);
      symbol.nameColumn = int(at < 0 ? 0 : at);
      symbol.nameLength = int(at < 0 ? 0 : header->name.size());
      m_procedure = std::move(symbol);
      m_procedureOpen = here;
      m_bodyStarted = false;
      return;
    }
    case Kind::ProcEnd:
      if (!m_procedure) {
        problem(here, QStringLiteral("%1 ends no procedure").arg(shown.toString()));
        return;
      }
      endProcedure(last);
      return;
    default:
      break;
  }

  if (m_procedure) {
    if (!syntax::isDirective(kind)) m_bodyStarted = true;
    switch (kind) {
      case Kind::If:
        if (transform::IsBlockIf(text)) m_blocks.push_back(here);
        return;
      case Kind::SelectCase:
      case Kind::With:
      case Kind::For:
      case Kind::Do:
      case Kind::While:
        m_blocks.push_back(here);
        return;
      case Kind::Next: {
        // "Next j, i" ends two loops.
        const int loops = int(syntax::codePart(text).count(u',')) + 1;
        for (int i = 0; i < loops; ++i)
          close(m_blocks, Kind::For, here);
        return;
      }
      case Kind::EndIf:
      case Kind::EndSelect:
      case Kind::EndWith:
      case Kind::Loop:
      case Kind::Wend:
        close(m_blocks, openerOf(kind), here);
        return;
      default:
        return;
    }
  }

  // The declarations.
  if (m_typeOrEnum) {
    if (kind == Kind::TypeEnd || kind == Kind::EnumEnd) {
      m_typeOrEnum->endLine = last;
      if (last > m_typeOrEnum->line) m_outline.folds.push_back({m_typeOrEnum->line, last - 1});
      m_outline.symbols.push_back(std::move(*m_typeOrEnum));
      m_typeOrEnum.reset();
      return;
    }
    if (syntax::isDirective(kind)) return;
    if (const auto word = wordAfter(text, 0)) {
      const qsizetype at = wordColumn(firstLine, text.mid(word->start, word->length));
      m_typeOrEnum->children.push_back(
          {text.mid(word->start, word->length).toString(),
           m_typeOrEnum->kind == SymbolKind::Enum ? SymbolKind::EnumMember : SymbolKind::Field,
           QString(),
           first,
           last,
           int(std::max<qsizetype>(at, 0)),
           int(word->length),
           {}});
    }
    return;
  }
  switch (kind) {
    case Kind::TypeBegin:
    case Kind::EnumBegin: {
      const auto name = wordAfter(text, syntax::classify(text).scoped ? 2 : 1);
      if (!name) return;
      Symbol symbol;
      symbol.name = text.mid(name->start, name->length).toString();
      symbol.kind = kind == Kind::TypeBegin ? SymbolKind::Struct : SymbolKind::Enum;
      symbol.detail = kind == Kind::TypeBegin ? QStringLiteral("Type") : QStringLiteral("Enum");
      symbol.line = first;
      const qsizetype at = wordColumn(firstLine, symbol.name);
      symbol.nameColumn = int(std::max<qsizetype>(at, 0));
      symbol.nameLength = int(symbol.name.size());
      m_typeOrEnum = std::move(symbol);
      return;
    }
    case Kind::TypeEnd:
    case Kind::EnumEnd:
      problem(here, QStringLiteral("%1 closes no block: indentation cannot tell which level ends here")
                        .arg(blockName(kind)));
      return;
    case Kind::Variable:
    case Kind::Const:
    case Kind::Event:
    case Kind::Declare: {
      const auto declaration = syntax::parseDeclaration(text);
      if (!declaration) return;
      for (const QString& name : declaration->names) {
        Symbol symbol;
        symbol.name = name;
        symbol.kind = kind == Kind::Const     ? SymbolKind::Constant
                      : kind == Kind::Event   ? SymbolKind::Event
                      : kind == Kind::Declare ? SymbolKind::Function
                                              : SymbolKind::Variable;
        symbol.detail = kind == Kind::Const     ? QStringLiteral("Const")
                        : kind == Kind::Event   ? QStringLiteral("Event")
                        : kind == Kind::Declare ? QStringLiteral("Declare")
                                                : QStringLiteral("Dim");
        symbol.line = first;
        symbol.endLine = last;
        // The name on the statement's line where it stands there (a continued list may carry it below).
        for (int line = first; line <= last; ++line) {
          const qsizetype at = wordColumn(m_lines[size_t(line)], name);
          if (at < 0) continue;
          symbol.line = line;
          symbol.nameColumn = int(at);
          symbol.nameLength = int(name.size());
          break;
        }
        m_outline.symbols.push_back(std::move(symbol));
      }
      return;
    }
    default:
      return;
  }
}

Outline Reader::finish() {
  if (m_procedure) {
    problem(*m_procedureOpen,
            QStringLiteral("%1 has no End: indentation cannot tell where it ends").arg(m_procedure->name));
    endProcedure(int(m_lines.size()) - 1);
  }
  if (m_typeOrEnum)
    unclosed({m_typeOrEnum->kind == SymbolKind::Struct ? Kind::TypeBegin : Kind::EnumBegin,
              m_typeOrEnum->line, m_typeOrEnum->nameColumn, m_typeOrEnum->nameLength});
  closeBlocks(m_directives);
  return std::move(m_outline);
}

}  // namespace

Outline readOutline(const std::vector<QStringView>& lines, int firstCodeLine) {
  Reader reader(lines);
  syntax::Carry carry;
  std::vector<QStringView> statement;
  QString joined;
  // A statement on one line is read where it stands; only continued ones are joined.
  const auto read = [&](int first, int last) {
    if (statement.size() == 1 && !syntax::continues(statement.front())) {
      reader.statement(first, last, lines[size_t(first)], statement.front());
    } else {
      joined = syntax::joinContinuedLines(statement);
      reader.statement(first, last, lines[size_t(first)], joined);
    }
  };
  int first = firstCodeLine;
  for (int i = firstCodeLine; i < int(lines.size()); ++i) {
    const QStringView line = lines[size_t(i)];
    if (!carry.continued) {
      first = i;
      statement.clear();
      // Hidden member attributes sit between code lines; they are no part of the code.
      if (syntax::isModuleAttribute(line) || syntax::parseAttribute(line)) continue;
    }
    const bool inComment = carry.inComment;
    carry = syntax::carryAfter(line, carry);
    if (!inComment) statement.push_back(line);
    if (!carry.continued && !statement.empty()) read(first, i);
  }
  if (carry.continued && !statement.empty()) read(first, int(lines.size()) - 1);
  return reader.finish();
}

}  // namespace lsp
