// SPDX-License-Identifier: MIT
#include "vbhighlighter.h"

#include <QPlainTextEdit>
#include <QScrollBar>
#include <QSet>
#include <QTextBlock>

namespace desktop {
namespace {

/// Blocks coloured beyond the visible ones, so that small scrolls find them ready.
constexpr int kMargin = 60;

const QSet<QString>& keywords() {
  static const QSet<QString> words = [] {
    QSet<QString> set;
    for (const char* word :
         {"addressof", "alias",      "and",      "any",     "as",      "base",       "binary",
          "boolean",   "byref",      "byte",     "byval",   "call",    "case",       "cbool",
          "cbyte",     "ccur",       "cdate",    "cdbl",    "cdec",    "cint",       "clng",
          "close",     "compare",    "const",    "csng",    "cstr",    "currency",   "cvar",
          "date",      "debug",      "decimal",  "declare", "defbool", "defbyte",    "defcur",
          "defdate",   "defdbl",     "defint",   "deflng",  "defobj",  "defsng",     "defstr",
          "defvar",    "dim",        "do",       "double",  "each",    "else",       "elseif",
          "empty",     "end",        "enum",     "eqv",     "erase",   "error",      "event",
          "exit",      "explicit",   "false",    "for",     "friend",  "function",   "get",
          "global",    "gosub",      "goto",     "if",      "imp",     "implements", "in",
          "input",     "integer",    "is",       "let",     "lib",     "like",       "line",
          "lock",      "long",       "loop",     "lset",    "me",      "mod",        "module",
          "new",       "next",       "not",      "nothing", "null",    "object",     "on",
          "open",      "option",     "optional", "or",      "output",  "paramarray", "preserve",
          "print",     "private",    "property", "public",  "put",     "raiseevent", "random",
          "read",      "redim",      "resume",   "return",  "rset",    "seek",       "select",
          "set",       "shared",     "single",   "spc",     "static",  "step",       "stop",
          "string",    "sub",        "tab",      "text",    "then",    "to",         "true",
          "type",      "typeof",     "unlock",   "until",   "variant", "wend",       "while",
          "with",      "withevents", "write",    "xor"})
      set.insert(QString::fromLatin1(word));
    return set;
  }();
  return words;
}

bool isWordStart(QChar c) {
  return c.isLetter() || c == u'_';
}
bool isWordChar(QChar c) {
  return c.isLetterOrNumber() || c == u'_';
}

/// A line (or comment) that ends with " _" goes on on the next line.
bool continues(QStringView text) {
  const QStringView trimmed = text.trimmed();
  return trimmed.endsWith(u'_') && (trimmed.size() == 1 || trimmed.at(trimmed.size() - 2).isSpace());
}

}  // namespace

VbHighlighter::VbHighlighter(QPlainTextEdit* editor)
    : QSyntaxHighlighter(editor->document()), m_editor(editor) {
  m_keyword.setForeground(QColor(0x00, 0x00, 0x90));
  m_comment.setForeground(QColor(0x00, 0x80, 0x00));
  m_string.setForeground(QColor(0x9a, 0x1c, 0x1c));
}

bool VbHighlighter::isKeyword(QStringView word) {
  return keywords().contains(word.toString().toLower());
}

bool VbHighlighter::nearVisible(int blockNumber) const {
  if (m_colourAll) return true;
  const int first = m_editor->verticalScrollBar()->value();
  const int height =
      std::max(1, m_editor->viewport()->height() / std::max(1, m_editor->fontMetrics().height()));
  return blockNumber >= first - kMargin && blockNumber <= first + height + kMargin;
}

void VbHighlighter::colourVisible() {
  const int first = m_editor->verticalScrollBar()->value();
  const int height =
      std::max(1, m_editor->viewport()->height() / std::max(1, m_editor->fontMetrics().height()));
  QTextBlock block = document()->findBlockByNumber(std::max(0, first - kMargin));
  const int last = first + height + kMargin;
  for (; block.isValid() && block.blockNumber() <= last; block = block.next())
    if (block.userState() == kNotColoured) rehighlightBlock(block);
}

void VbHighlighter::highlightBlock(const QString& text) {
  if (!nearVisible(currentBlock().blockNumber())) {
    setCurrentBlockState(kNotColoured);
    return;
  }
  const bool inComment =
      previousBlockState() == kNotColoured ? startsInComment() : previousBlockState() == kInComment;
  setCurrentBlockState(colour(text, inComment, true) ? kInComment : kColoured);
}

bool VbHighlighter::startsInComment() {
  // Walk up to the first line of the logical line, then read forward.
  QTextBlock block = currentBlock().previous();
  if (!block.isValid() || !continues(block.text())) return false;
  std::vector<QString> lines;
  int guard = 0;
  while (block.isValid() && continues(block.text()) && guard++ < 25) {
    lines.push_back(block.text());
    block = block.previous();
  }
  bool inComment = false;
  for (auto it = lines.rbegin(); it != lines.rend(); ++it)
    inComment = colour(*it, inComment, false);
  return inComment;
}

bool VbHighlighter::colour(const QString& text, bool inComment, bool apply) {
  const qsizetype n = text.size();
  if (inComment) {
    if (apply) setFormat(0, static_cast<int>(n), m_comment);
    return continues(text);
  }
  bool statementStart = true;
  qsizetype i = 0;
  while (i < n) {
    const QChar c = text.at(i);
    if (c == u'\'') {
      if (apply) setFormat(static_cast<int>(i), static_cast<int>(n - i), m_comment);
      return continues(text);
    }
    if (c == u'"') {
      qsizetype j = i + 1;
      while (j < n) {
        if (text.at(j) == u'"') {
          if (j + 1 < n && text.at(j + 1) == u'"') {
            j += 2;
            continue;
          }
          break;
        }
        ++j;
      }
      if (apply) setFormat(static_cast<int>(i), static_cast<int>(std::min(j + 1, n) - i), m_string);
      i = j + 1;
      statementStart = false;
      continue;
    }
    if (c == u'#' && statementStart) {  // #If, #Else, #Const ...
      qsizetype j = i + 1;
      while (j < n && isWordChar(text.at(j)))
        ++j;
      if (apply) setFormat(static_cast<int>(i), static_cast<int>(j - i), m_keyword);
      i = j;
      statementStart = false;
      continue;
    }
    if (isWordStart(c)) {
      qsizetype j = i + 1;
      while (j < n && isWordChar(text.at(j)))
        ++j;
      const QStringView word = QStringView(text).mid(i, j - i);
      if (statementStart && word.compare(u"Rem", Qt::CaseInsensitive) == 0 &&
          (j == n || text.at(j).isSpace())) {
        if (apply) setFormat(static_cast<int>(i), static_cast<int>(n - i), m_comment);
        return continues(text);
      }
      // A member after a dot (obj.Print, rs.Close) is not a keyword.
      const bool afterDot = i > 0 && text.at(i - 1) == u'.';
      if (!afterDot && isKeyword(word) && apply)
        setFormat(static_cast<int>(i), static_cast<int>(j - i), m_keyword);
      i = j;
      statementStart = false;
      continue;
    }
    if (c.isDigit() && statementStart) {  // a line number or label leaves the statement to come
      while (i < n && text.at(i).isDigit())
        ++i;
      continue;
    }
    if (c == u':')
      statementStart = true;
    else if (!c.isSpace())
      statementStart = false;
    ++i;
  }
  return false;
}

}  // namespace desktop
