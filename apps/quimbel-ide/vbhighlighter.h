// SPDX-License-Identifier: MIT
// VB syntax colours for a code window: keywords, comments (also continued with " _"), strings. Only the
// blocks near the visible part of the editor are coloured, so that a module of a hundred thousand lines
// opens at once; the editor colours the rest as it scrolls to them.
#pragma once

#include <QSyntaxHighlighter>
#include <QTextCharFormat>

class QPlainTextEdit;

namespace desktop {

class VbHighlighter final : public QSyntaxHighlighter {
  Q_OBJECT

 public:
  /// Block states: not coloured yet, coloured, coloured and ending inside a continued comment.
  static constexpr int kNotColoured = -1;
  static constexpr int kColoured = 0;
  static constexpr int kInComment = 1;

  explicit VbHighlighter(QPlainTextEdit* editor);

  /// Colours the blocks of the visible part that are not coloured yet.
  void colourVisible();

  static bool isKeyword(QStringView word);

 protected:
  void highlightBlock(const QString& text) override;

 private:
  bool nearVisible(int blockNumber) const;
  /// Whether the line above starts inside a continued comment, worked out from the text when the line
  /// above is not coloured.
  bool startsInComment();
  /// Colours `text` (starting inside a comment or not); returns whether it ends inside a continued one.
  bool colour(const QString& text, bool inComment, bool apply);

  QPlainTextEdit* m_editor;
  QTextCharFormat m_keyword;
  QTextCharFormat m_comment;
  QTextCharFormat m_string;
  bool m_colourAll = false;
};

}  // namespace desktop
