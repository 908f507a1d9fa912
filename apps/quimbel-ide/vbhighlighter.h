// SPDX-License-Identifier: MIT
// VB syntax colours for a code window, from the code colour scheme (CodeColours): keywords, comments (also
// continued with " _"), identifiers, and a line with a syntax error (a string left open) in the error
// colour; strings have no colour of their own. Only the lines in and around the visible part of the editor
// are coloured, when they come into view or change, so that a module of a hundred thousand lines opens
// without colouring it all first.
#pragma once

#include <QList>
#include <QObject>
#include <QStringView>
#include <QTextCharFormat>
#include <QTextLayout>

class QPlainTextEdit;
class QTextBlock;

namespace desktop {

class VbHighlighter final : public QObject {
  Q_OBJECT

 public:
  /// A block's user state: not coloured yet, coloured, coloured and ending inside a continued comment.
  static constexpr int kNotColoured = -1;
  static constexpr int kColoured = 0;
  static constexpr int kInComment = 1;

  explicit VbHighlighter(QPlainTextEdit* editor);

  /// Colours the lines of the visible part (and a margin around it) that are not coloured yet.
  void colourVisible();

  static bool isKeyword(QStringView word);
  /// Takes the scheme's colours again and colours the lines anew.
  void applyColours();
  /// The colours of one line: the format ranges, and whether the line ends inside a continued comment.
  bool colour(const QString& text, bool inComment, QList<QTextLayout::FormatRange>* formats) const;

 private:
  void contentsChanged(int position, int removed, int added);
  /// Colours `block`, then the blocks after it while the comment state they start with changed.
  void colourFrom(QTextBlock block);
  /// Whether the line before `block` ends inside a continued comment, read from its text when it is not
  /// coloured.
  bool startsInComment(const QTextBlock& block) const;
  bool nearVisible(int blockNumber) const;

  QPlainTextEdit* m_editor;
  QTextCharFormat m_keyword;
  QTextCharFormat m_comment;
  QTextCharFormat m_error;
  QTextCharFormat m_identifier;
  bool m_identifiers = false;  // false while identifiers are drawn as normal text
  bool m_applying = false;
};

}  // namespace desktop
