// SPDX-License-Identifier: MIT
#include "vbhighlighter.h"

#include "codecolours.h"

#include <QPlainTextEdit>
#include <QScrollBar>
#include <QSet>
#include <QTextBlock>
#include <QTextDocument>

#include <vector>

namespace desktop {
namespace {

/// Lines coloured beyond the visible ones, so that small scrolls find them ready.
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

void addRange(QList<QTextLayout::FormatRange>* formats, qsizetype start, qsizetype length,
              const QTextCharFormat& format) {
  if (formats && length > 0)
    formats->append(QTextLayout::FormatRange{static_cast<int>(start), static_cast<int>(length), format});
}

}  // namespace

VbHighlighter::VbHighlighter(QPlainTextEdit* editor) : QObject(editor), m_editor(editor) {
  connect(editor->document(), &QTextDocument::contentsChange, this, &VbHighlighter::contentsChanged);
  connect(&CodeColours::instance(), &CodeColours::changed, this, &VbHighlighter::applyColours);
  applyColours();
}

void VbHighlighter::applyColours() {
  const CodeColours& colours = CodeColours::instance();
  const auto formatOf = [&](CodeText kind) {
    QTextCharFormat format;
    format.setForeground(colours.foreground(kind));
    if (colours.colour(kind).background.isValid()) format.setBackground(colours.colour(kind).background);
    return format;
  };
  m_keyword = formatOf(CodeText::Keyword);
  m_comment = formatOf(CodeText::Comment);
  m_error = formatOf(CodeText::SyntaxError);
  const CodeColour identifier = colours.colour(CodeText::Identifier);
  m_identifiers = identifier.foreground.isValid() || identifier.background.isValid();
  m_identifier = formatOf(CodeText::Identifier);
  for (QTextBlock block = m_editor->document()->firstBlock(); block.isValid(); block = block.next())
    block.setUserState(kNotColoured);
  colourVisible();
}

bool VbHighlighter::isKeyword(QStringView word) {
  return keywords().contains(word.toString().toLower());
}

bool VbHighlighter::nearVisible(int blockNumber) const {
  const int first = m_editor->verticalScrollBar()->value();
  const int height = m_editor->viewport()->height() / std::max(1, m_editor->fontMetrics().lineSpacing());
  return blockNumber >= first - kMargin && blockNumber <= first + height + kMargin;
}

void VbHighlighter::colourVisible() {
  const int first = m_editor->verticalScrollBar()->value();
  const int height = m_editor->viewport()->height() / std::max(1, m_editor->fontMetrics().lineSpacing());
  QTextBlock block = m_editor->document()->findBlockByNumber(std::max(0, first - kMargin));
  const int last = first + height + kMargin;
  for (; block.isValid() && block.blockNumber() <= last; block = block.next())
    if (block.userState() == kNotColoured) colourFrom(block);
}

void VbHighlighter::contentsChanged(int position, int /*removed*/, int added) {
  if (m_applying) return;  // the formats this class sets mark their blocks changed
  QTextDocument* document = m_editor->document();
  QTextBlock block = document->findBlock(position);
  QTextBlock last = document->findBlock(position + added);
  if (!last.isValid()) last = document->lastBlock();
  // Changed lines near the view are coloured now; the others when they come into view.
  const int first = m_editor->verticalScrollBar()->value() - kMargin;
  const int height = m_editor->viewport()->height() / std::max(1, m_editor->fontMetrics().lineSpacing());
  const int end = first + height + 2 * kMargin;
  for (int number = block.blockNumber(); block.isValid(); block = block.next(), ++number) {
    if (number >= first && number <= end)
      colourFrom(block);
    else
      block.setUserState(kNotColoured);
    if (block == last) break;
  }
}

bool VbHighlighter::startsInComment(const QTextBlock& block) const {
  QTextBlock previous = block.previous();
  if (!previous.isValid()) return false;
  if (previous.userState() != kNotColoured) return previous.userState() == kInComment;
  if (!continues(previous.text())) return false;
  // Up to the first line of the logical line (at most 24 continuations), then read forward.
  std::vector<QString> lines;
  while (previous.isValid() && continues(previous.text()) && lines.size() < 25) {
    lines.push_back(previous.text());
    previous = previous.previous();
  }
  bool inComment = false;
  for (auto it = lines.rbegin(); it != lines.rend(); ++it)
    inComment = colour(*it, inComment, nullptr);
  return inComment;
}

void VbHighlighter::colourFrom(QTextBlock block) {
  QTextDocument* document = m_editor->document();
  bool inComment = startsInComment(block);
  while (block.isValid()) {
    const int before = block.userState();
    QList<QTextLayout::FormatRange> formats;
    const bool endsInComment = colour(block.text(), inComment, &formats);
    const int after = endsInComment ? kInComment : kColoured;
    block.setUserState(after);
    if (block.layout()->formats() != formats) {
      m_applying = true;
      block.layout()->setFormats(formats);
      document->markContentsDirty(block.position(), block.length());
      m_applying = false;
    }
    // The next line starts where this one ends: only a change of that carries on.
    QTextBlock next = block.next();
    if (!next.isValid() || before == after || next.userState() == kNotColoured) break;
    if (!nearVisible(next.blockNumber())) {
      next.setUserState(kNotColoured);
      break;
    }
    block = next;
    inComment = endsInComment;
  }
}

bool VbHighlighter::colour(const QString& text, bool inComment,
                           QList<QTextLayout::FormatRange>* formats) const {
  const qsizetype n = text.size();
  if (inComment) {
    addRange(formats, 0, n, m_comment);
    return continues(text);
  }
  const qsizetype before = formats ? formats->size() : 0;
  bool statementStart = true;
  qsizetype i = 0;
  while (i < n) {
    const QChar c = text.at(i);
    if (c == u'\'') {
      addRange(formats, i, n - i, m_comment);
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
      if (j >= n) {
        // A string left open is a syntax error: the whole line takes the error colour.
        if (formats) {
          formats->resize(before);
          addRange(formats, 0, n, m_error);
        }
        return false;
      }
      i = j + 1;
      statementStart = false;
      continue;
    }
    if (c == u'#' && statementStart) {  // #If, #Else, #Const ...
      qsizetype j = i + 1;
      while (j < n && isWordChar(text.at(j)))
        ++j;
      addRange(formats, i, j - i, m_keyword);
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
        addRange(formats, i, n - i, m_comment);
        return continues(text);
      }
      // A member after a dot (obj.Print, rs.Close) is not a keyword.
      const bool afterDot = i > 0 && text.at(i - 1) == u'.';
      if (!afterDot && isKeyword(word))
        addRange(formats, i, j - i, m_keyword);
      else if (m_identifiers)
        addRange(formats, i, j - i, m_identifier);
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
