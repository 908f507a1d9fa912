// SPDX-License-Identifier: MIT
// The reading of one line. Classification is written once, over a view of characters of either width, so
// that decoded text and Windows-1252 bytes are read by the same code.
#include "syntax/line.h"

#include "syntax/keywords.h"

#include <QString>

#include <string_view>

namespace syntax {
namespace {

template <class Ch>
using View = std::basic_string_view<Ch>;

std::u16string_view view(QStringView text) noexcept {
  return {text.utf16(), size_t(text.size())};
}
std::string_view view(QByteArrayView bytes) noexcept {
  return {bytes.data(), size_t(bytes.size())};
}

template <class Ch>
constexpr bool blank(Ch c) noexcept {
  return c == Ch(' ') || c == Ch('\t');
}

template <class Ch>
bool identifierChar(Ch c) noexcept {
  return isIdentifierChar(c);
}

/// `word` is the ASCII `keyword` in any letter case.
template <class Ch>
bool is(View<Ch> word, std::string_view keyword) noexcept {
  if (word.size() != keyword.size()) return false;
  for (size_t i = 0; i < word.size(); ++i) {
    const auto c = static_cast<char16_t>(static_cast<std::make_unsigned_t<Ch>>(word[i]));
    if ((c | 0x20) != char16_t(keyword[i] | 0x20)) return false;
  }
  return true;
}

template <class Ch>
bool continuesAt(View<Ch> line) noexcept {
  size_t end = line.size();
  while (end > 0 && blank(line[end - 1]))
    --end;
  return end > 0 && line[end - 1] == Ch('_') && (end == 1 || blank(line[end - 2]));
}

/// Walks a statement word by word.
template <class Ch>
class Words {
 public:
  explicit Words(View<Ch> text) : m_text(text) {}

  void skipBlanks() {
    while (m_pos < m_text.size() && blank(m_text[m_pos]))
      ++m_pos;
  }
  /// The next identifier-like word (empty when the next character does not start one).
  View<Ch> word() {
    skipBlanks();
    const size_t start = m_pos;
    while (m_pos < m_text.size() && identifierChar(m_text[m_pos]))
      ++m_pos;
    return m_text.substr(start, m_pos - start);
  }
  /// The character after the last word (0 at the end).
  Ch following() const { return m_pos < m_text.size() ? m_text[m_pos] : Ch(0); }

 private:
  View<Ch> m_text;
  size_t m_pos = 0;
};

/// A statement that declares something names it right after its keyword: "Sub As Long" or "Type = 2" is a
/// Type or Enum member whose name only looks like a keyword.
template <class Ch>
bool namesSomething(View<Ch> word) {
  return !word.empty() && !is(word, "As");
}

/// A keyword statement stands alone or is followed by a blank, a comment or a statement separator:
/// "Else", "Next i", "Loop ' x", "Else:"; "Nextx = 1" or "Do_It" are other words.
template <class Ch>
bool endsStatementWord(Ch following) {
  return following == Ch(0) || blank(following) || following == Ch('\'') || following == Ch(':');
}

template <class Ch>
Statement classifyText(View<Ch> text) noexcept {
  size_t i = 0;
  while (i < text.size() && blank(text[i]))
    ++i;
  if (i == text.size()) return {Kind::Blank};
  const Ch first = text[i];
  if (first == Ch('\'')) return {Kind::Comment};
  if (first == Ch('#')) {
    Words<Ch> words(text.substr(i + 1));
    const View<Ch> w = words.word();
    if (is(w, "If")) return {Kind::DirectiveIf};
    if (is(w, "ElseIf")) return {Kind::DirectiveElseIf};
    if (is(w, "Else")) return {Kind::DirectiveElse};
    if (is(w, "End") && is(words.word(), "If")) return {Kind::DirectiveEndIf};
    return {Kind::Directive};
  }
  Words<Ch> words(text.substr(i));
  View<Ch> w = words.word();
  if (w.empty()) return {Kind::Code};

  // Statements that cannot take modifiers, by their first word.
  switch (static_cast<char16_t>(w.front()) | 0x20) {
    case u'a':
      if (is(w, "Attribute") && blank(words.following())) return {Kind::Attribute};
      break;
    case u'c':
      if (is(w, "Case") && endsStatementWord(words.following())) return {Kind::Case};
      break;
    case u'd':
      if (is(w, "Do") && endsStatementWord(words.following())) return {Kind::Do};
      break;
    case u'e':
      if (is(w, "End")) {
        const View<Ch> what = words.word();
        if (is(what, "Sub") || is(what, "Function") || is(what, "Property")) return {Kind::ProcEnd};
        if (is(what, "If")) return {Kind::EndIf};
        if (is(what, "Select")) return {Kind::EndSelect};
        if (is(what, "With")) return {Kind::EndWith};
        if (is(what, "Type")) return {Kind::TypeEnd};
        if (is(what, "Enum")) return {Kind::EnumEnd};
        return {Kind::Code};
      }
      if (is(w, "ElseIf")) return {Kind::ElseIf};
      if (is(w, "Else") && endsStatementWord(words.following())) return {Kind::Else};
      break;
    case u'f':
      if (is(w, "For") && endsStatementWord(words.following())) return {Kind::For};
      break;
    case u'i':
      if (is(w, "If") && (endsStatementWord(words.following()) || words.following() == Ch('(')))
        return {Kind::If};
      break;
    case u'l':
      if (is(w, "Loop") && endsStatementWord(words.following())) return {Kind::Loop};
      break;
    case u'n':
      if (is(w, "Next") && endsStatementWord(words.following())) return {Kind::Next};
      break;
    case u'r':
      if (is(w, "Rem") && (words.following() == Ch(0) || blank(words.following()))) return {Kind::Comment};
      break;
    case u's':
      if (is(w, "Select") && is(words.word(), "Case")) return {Kind::SelectCase};
      break;
    case u'w':
      if (is(w, "With") && endsStatementWord(words.following())) return {Kind::With};
      if (is(w, "While") && endsStatementWord(words.following())) return {Kind::While};
      if (is(w, "Wend") && endsStatementWord(words.following())) return {Kind::Wend};
      break;
    default:
      break;
  }

  // Declarations: scope and storage words, then what they declare.
  bool scoped = false;
  bool storage = false;  // Dim or Static
  for (;;) {
    if (is(w, "Public") || is(w, "Private") || is(w, "Friend") || is(w, "Global")) {
      scoped = true;
    } else if (is(w, "Dim") || is(w, "Static")) {
      storage = true;
    } else {
      break;
    }
    w = words.word();
  }
  const bool modified = scoped || storage;
  // A keyword begins a procedure or a block only when the statement goes on with a name: the letter case
  // of the keyword decides nothing.
  const Kind notDeclaring = modified ? Kind::Variable : Kind::Code;
  if (is(w, "Sub") || is(w, "Function"))
    return {namesSomething(words.word()) ? Kind::ProcHeader : notDeclaring, scoped};
  if (is(w, "Property")) {
    const View<Ch> accessor = words.word();
    if (is(accessor, "Get") || is(accessor, "Let") || is(accessor, "Set"))
      return {namesSomething(words.word()) ? Kind::ProcHeader : notDeclaring, scoped};
    return {notDeclaring, scoped};
  }
  if (is(w, "Declare")) return {Kind::Declare, scoped};
  if (is(w, "Event")) return {Kind::Event, scoped};
  if (is(w, "Const")) return {Kind::Const, scoped};
  if ((is(w, "Type") || is(w, "Enum")) && !storage) {
    const bool isType = is(w, "Type");
    if (namesSomething(words.word())) return {isType ? Kind::TypeBegin : Kind::EnumBegin, scoped};
    return {notDeclaring, scoped};
  }
  if (modified && !w.empty()) return {Kind::Variable, scoped};
  return {Kind::Code, scoped};
}

template <class Ch>
bool moduleAttributeAt(View<Ch> text) noexcept {
  Words<Ch> words(text);
  if (!is(words.word(), "Attribute") || !blank(words.following())) return false;
  words.skipBlanks();
  const View<Ch> name = words.word();
  return name.size() >= 3 && is(name.substr(0, 3), "VB_");
}

}  // namespace

// ---------------------------------------------------------------------------------------------------

bool continues(QStringView line) noexcept {
  return continuesAt(view(line));
}

bool continues(QByteArrayView line) noexcept {
  return continuesAt(view(line));
}

QStringView withoutContinuationMark(QStringView line) noexcept {
  if (!continues(line)) return line;
  return rightTrimmedView(line).chopped(1);
}

qsizetype commentStart(QStringView line, bool inComment) {
  if (inComment) return 0;
  // Most lines hold neither an apostrophe nor the letters of Rem: they need no tokens.
  bool maybe = false;
  for (const QChar c : line) {
    if (c == u'\'' || (c.unicode() | 0x20) == u'r') {
      maybe = true;
      break;
    }
  }
  if (!maybe) return -1;
  Tokenizer tokens(line);
  Token token;
  while (tokens.next(token))
    if (token.type == Token::Type::Comment) return token.start;
  return -1;
}

QStringView codePart(QStringView line, bool inComment) {
  const qsizetype comment = commentStart(line, inComment);
  return rightTrimmedView(comment < 0 ? line : line.first(comment));
}

Carry carryAfter(QStringView line, Carry before) {
  Carry after;
  after.continued = continues(line);
  if (after.continued) after.inComment = before.inComment || commentStart(line, false) >= 0;
  return after;
}

Statement classify(QStringView text) noexcept {
  return classifyText(view(text));
}

namespace {

/// Whether classify(text) is `kind`, whose statements all begin with `letter` (lower case): most lines are
/// told apart by their first character alone.
bool isKindStartingWith(QStringView text, char16_t letter, Kind kind) noexcept {
  const qsizetype first = skipBlanks(text, 0);
  return first < text.size() && (text[first].unicode() | 0x20) == letter && classify(text).kind == kind;
}

}  // namespace

bool isAttributeStatement(QStringView text) noexcept {
  return isKindStartingWith(text, u'a', Kind::Attribute);
}

bool isProcedureEnd(QStringView text) noexcept {
  return isKindStartingWith(text, u'e', Kind::ProcEnd);
}

Statement classify(QByteArrayView text) noexcept {
  return classifyText(view(text));
}

// ---------------------------------------------------------------------------------------------------

bool NumberPrefix::commentFollows() const {
  return form == Form::Comment || (form == Form::Blank && trimmedView(rest).startsWith(u'\''));
}

NumberPrefix numberPrefix(QStringView trimmed) noexcept {
  if (!mayBeginNumber(trimmed)) return {};
  qsizetype end = 0;
  while (end < trimmed.size()) {
    const QChar c = trimmed[end];
    if (isBlank(c) || c == u':' || c == u'\'') break;
    ++end;
  }
  const QStringView number = trimmed.first(end);
  if (!isUsableNumber(number)) return {};
  if (end == trimmed.size()) return {NumberPrefix::Form::Alone, number, {}};
  const QChar after = trimmed[end];
  if (after == u':') return {NumberPrefix::Form::Colon, number, trimmed.sliced(end + 1)};
  if (after == u'\'') return {NumberPrefix::Form::Comment, number, trimmed.sliced(end)};
  return {NumberPrefix::Form::Blank, number, trimmed.sliced(end + 1)};
}

bool beginsWithLabel(QStringView trimmed) noexcept {
  if (trimmed.isEmpty() || !isIdentifierStart(trimmed.front().unicode())) return false;
  qsizetype i = 1;
  while (i < trimmed.size() && isIdentifierChar(trimmed[i]))
    ++i;
  if (i >= trimmed.size() || trimmed[i] != u':') return false;
  if (i + 1 < trimmed.size() && trimmed[i + 1] == u'=') return false;
  return !isReservedWord(trimmed.first(i));
}

// ---------------------------------------------------------------------------------------------------

std::optional<AttributeLine> parseAttribute(QStringView line) noexcept {
  qsizetype i = skipBlanks(line, 0);
  constexpr QStringView kWord = u"Attribute";
  if (line.size() - i <= kWord.size() || !isKeyword(line.sliced(i, kWord.size()), kWord) ||
      !isBlank(line[i + kWord.size()]))
    return std::nullopt;
  i = skipBlanks(line, i + kWord.size());
  AttributeLine parts;
  const qsizetype equals = line.indexOf(u'=', i);
  const qsizetype nameEnd = equals < 0 ? line.size() : equals;
  parts.name = trimmedView(line.sliced(i, nameEnd - i));
  if (equals >= 0) parts.value = trimmedView(line.sliced(equals + 1));
  const qsizetype dot = parts.name.indexOf(u'.');
  if (dot >= 0) {
    parts.ownerStart = i;
    parts.owner = trimmedView(parts.name.first(dot));
    parts.attribute = trimmedView(parts.name.sliced(dot + 1));
  }
  return parts;
}

bool isModuleAttribute(QStringView line) noexcept {
  return moduleAttributeAt(view(line));
}

bool isModuleAttribute(QByteArrayView line) noexcept {
  return moduleAttributeAt(view(line));
}

// ---------------------------------------------------------------------------------------------------

bool Tokenizer::next(Token& token) {
  const qsizetype n = m_line.size();
  while (m_pos < n && isBlank(m_line[m_pos]))
    ++m_pos;
  if (m_pos >= n) return false;
  token = Token{};
  token.start = m_pos;
  token.statementStart = m_statementStart;
  const bool first = std::exchange(m_first, false);
  const QChar c = m_line[m_pos];
  const auto finish = [&](Token::Type type, qsizetype end) {
    token.type = type;
    token.length = end - token.start;
    m_pos = end;
    m_statementStart = false;
    return true;
  };

  if (m_inComment || c == u'\'') return finish(Token::Type::Comment, n);
  if (c == u'"') {
    qsizetype j = m_pos + 1;
    while (j < n) {
      if (m_line[j] == u'"') {
        if (j + 1 < n && m_line[j + 1] == u'"') {
          j += 2;
          continue;
        }
        return finish(Token::Type::String, j + 1);
      }
      ++j;
    }
    return finish(Token::Type::OpenString, n);
  }
  if (c == u'#' && m_statementStart) {
    qsizetype j = m_pos + 1;
    while (j < n && isIdentifierChar(m_line[j]))
      ++j;
    return finish(Token::Type::Directive, j);
  }
  if (isIdentifierStart(c.unicode()) || c == u'_') {
    qsizetype j = m_pos + 1;
    while (j < n && isIdentifierChar(m_line[j]))
      ++j;
    token.afterDot = m_pos > 0 && m_line[m_pos - 1] == u'.';
    const QStringView word = m_line.sliced(m_pos, j - m_pos);
    if (m_statementStart && isKeyword(word, u"Rem") && (j == n || isBlank(m_line[j])))
      return finish(Token::Type::Comment, n);
    return finish(Token::Type::Word, j);
  }
  if (isDigit(c.unicode())) {
    qsizetype j = m_pos;
    bool digitsOnly = true;
    while (j < n && (isIdentifierChar(m_line[j]) || m_line[j] == u'.')) {
      digitsOnly = digitsOnly && isDigit(m_line[j].unicode());
      ++j;
    }
    token.digitsOnly = digitsOnly;
    const bool statementStart = m_statementStart;
    finish(Token::Type::Number, j);
    // A line number leaves the statement to come.
    m_statementStart = first && statementStart && digitsOnly;
    return true;
  }
  if (c == u':' && (m_pos + 1 == n || m_line[m_pos + 1] != u'=')) {
    finish(Token::Type::Colon, m_pos + 1);
    m_statementStart = true;
    return true;
  }
  if (c == u',') return finish(Token::Type::Comma, m_pos + 1);
  return finish(Token::Type::Other, m_pos + 1);
}

QString joinContinuedLines(const std::vector<QStringView>& lines) {
  QString joined;
  for (const QStringView line : lines)
    joined += withoutContinuationMark(line);
  return joined;
}

bool endsProcedureAfterColon(QStringView line) {
  Tokenizer tokens(line);
  Token token;
  bool afterColon = false;
  while (tokens.next(token)) {
    if (token.type == Token::Type::Colon) {
      afterColon = true;
    } else if (afterColon && token.statementStart && token.type == Token::Type::Word &&
               classify(line.sliced(token.start)).kind == Kind::ProcEnd) {
      return true;
    }
  }
  return false;
}

}  // namespace syntax
