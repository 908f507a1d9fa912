// SPDX-License-Identifier: MIT
#include "vbhighlighter.h"

#include "codecolours.h"
#include "syntax/keywords.h"
#include "syntax/line.h"

#include <QPlainTextEdit>
#include <QScrollBar>
#include <QTextBlock>
#include <QTextDocument>

#include <vector>

namespace desktop {
namespace {

/// Lines coloured beyond the visible ones, so that small scrolls find them ready.
constexpr int kMargin = 60;

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
  return syntax::isColouredKeyword(word);
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
  if (!syntax::continues(previous.text())) return false;
  // Up to the first line of the logical line (at most 24 continuations), then read forward.
  std::vector<QString> lines;
  while (previous.isValid() && syntax::continues(previous.text()) && lines.size() < 25) {
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
  const qsizetype before = formats ? formats->size() : 0;
  syntax::Tokenizer tokens(text, inComment);
  syntax::Token token;
  while (tokens.next(token)) {
    switch (token.type) {
      case syntax::Token::Type::Comment:
        // A comment's continuation line is comment from its first column, blanks included.
        if (inComment) token.length += token.start, token.start = 0;
        addRange(formats, token.start, token.length, m_comment);
        return syntax::continues(text);  // a comment that ends with the mark goes on below
      case syntax::Token::Type::OpenString:
        // A string left open is a syntax error: the whole line takes the error colour.
        if (formats) {
          formats->resize(before);
          addRange(formats, 0, text.size(), m_error);
        }
        return false;
      case syntax::Token::Type::Directive:
        addRange(formats, token.start, token.length, m_keyword);
        break;
      case syntax::Token::Type::Word:
        // A member after a dot (obj.Print, rs.Close) is not a keyword.
        if (!token.afterDot && isKeyword(QStringView(text).sliced(token.start, token.length)))
          addRange(formats, token.start, token.length, m_keyword);
        else if (m_identifiers)
          addRange(formats, token.start, token.length, m_identifier);
        break;
      default:
        break;
    }
  }
  return false;
}

}  // namespace desktop
