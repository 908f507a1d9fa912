// SPDX-License-Identifier: MIT
// VB colours: which parts of a line are keywords, strings and comments, a comment continued onto the
// next line, and that only the lines near the view are coloured, the others when they come into view.
#include "vbhighlighter.h"
#include "codecolours.h"
#include "codeeditor.h"
#include "idefixture.h"
#include "optionsdialog.h"

#include <gtest/gtest.h>

#include <QComboBox>
#include <QListWidget>
#include <QScrollBar>
#include <QSettings>
#include <QTemporaryDir>
#include <QTest>
#include <QTextBlock>

namespace desktop {
namespace {

using test::settle;

/// The ranges of a line as "start+length:kind" with kind k (keyword), c (comment) or e (syntax error).
QString rangesOf(VbHighlighter& highlighter, const QString& text, bool inComment = false,
                 bool* endsInComment = nullptr) {
  QList<QTextLayout::FormatRange> formats;
  const bool ends = highlighter.colour(text, inComment, &formats);
  if (endsInComment) *endsInComment = ends;
  QStringList parts;
  for (const auto& range : formats) {
    const QColor color = range.format.foreground().color();
    const char kind = color == QColor(0x00, 0x80, 0x00) ? 'c' : color == QColor(0x00, 0x00, 0x80) ? 'k' : 'e';
    parts << u"%1+%2:%3"_qs.arg(range.start).arg(range.length).arg(QLatin1Char(kind));
  }
  return parts.join(u' ');
}

class Colours : public ::testing::Test {
 protected:
  CodeEditor m_editor;
  VbHighlighter& highlighter() { return *m_editor.highlighter(); }
};

TEST_F(Colours, KeywordsStringsAndCommentsOfALine) {
  EXPECT_EQ(rangesOf(highlighter(), u"Dim s As String ' nota"_qs), u"0+3:k 6+2:k 9+6:k 16+6:c"_qs);
  EXPECT_EQ(rangesOf(highlighter(), u"x = \"a\"\"b\" & y"_qs), QString()) << "strings have no colour";
  EXPECT_EQ(rangesOf(highlighter(), u"If x = \"Don't Then"_qs), u"0+18:e"_qs)
      << "a string left open is a syntax error: the whole line";
  EXPECT_EQ(rangesOf(highlighter(), u"#If Win32 Then"_qs), u"0+3:k 10+4:k"_qs);
  // Which word is a keyword, a member or a Rem is the tokenizer's rule; here, that it reaches the colours.
  EXPECT_EQ(rangesOf(highlighter(), u"rs.Close: Rem feito"_qs), u"10+9:c"_qs);
}

TEST_F(Colours, TheOptionsChangeTheColoursOfEveryCodeWindowAndRememberThem) {
  QTemporaryDir dir;
  QSettings settings(dir.filePath(u"quimbel-ide.ini"_qs), QSettings::IniFormat);
  OptionsDialog dialog(&settings);
  dialog.findChild<QListWidget*>(u"codeColorList"_qs)->setCurrentRow(static_cast<int>(CodeText::Keyword));
  auto* foreground = dialog.findChild<QComboBox*>(u"foregroundColor"_qs);
  EXPECT_EQ(foreground->currentData().value<QColor>(), QColor(0x00, 0x00, 0x80)) << "the IDE's dark blue";
  foreground->setCurrentIndex(foreground->findText(u"#ff0000"_qs));
  dialog.accept();
  QList<QTextLayout::FormatRange> formats;
  highlighter().colour(u"Dim"_qs, false, &formats);
  ASSERT_EQ(formats.size(), 1);
  EXPECT_EQ(formats.front().format.foreground().color(), QColor(0xff, 0x00, 0x00));
  CodeColours::instance().resetToDefaults();
  CodeColours::instance().load(settings);
  EXPECT_EQ(CodeColours::instance().colour(CodeText::Keyword).foreground, QColor(0xff, 0x00, 0x00));
  EXPECT_FALSE(CodeColours::instance().colour(CodeText::Normal).foreground.isValid()) << "Automatic";
  CodeColours::instance().resetToDefaults();
}

TEST_F(Colours, OnlyTheLinesNearTheViewAreColouredUntilTheyComeIntoView) {
  QStringList lines;
  for (int i = 1; i <= 2000; ++i)
    lines << u"Dim v%1 As Long"_qs.arg(i);
  m_editor.resize(500, 300);
  m_editor.show();
  m_editor.setPlainText(lines.join(u'\n'));
  settle();
  QTextDocument* document = m_editor.document();
  EXPECT_EQ(document->findBlockByNumber(0).userState(), VbHighlighter::kColoured);
  EXPECT_FALSE(document->findBlockByNumber(0).layout()->formats().isEmpty());
  EXPECT_EQ(document->findBlockByNumber(1500).userState(), VbHighlighter::kNotColoured);
  EXPECT_TRUE(document->findBlockByNumber(1500).layout()->formats().isEmpty());
  m_editor.verticalScrollBar()->setValue(1495);
  EXPECT_EQ(document->findBlockByNumber(1500).userState(), VbHighlighter::kColoured);
  EXPECT_FALSE(document->findBlockByNumber(1500).layout()->formats().isEmpty());
}

TEST_F(Colours, AnEditedLineIsColouredAgainAndTheLinesItContinuesInto) {
  m_editor.resize(500, 300);
  m_editor.show();
  m_editor.setPlainText(u"x = 1\ny = 2\nz = 3"_qs);
  settle();
  QTextDocument* document = m_editor.document();
  EXPECT_TRUE(document->findBlockByNumber(1).layout()->formats().isEmpty());
  QTextCursor cursor(document->findBlockByNumber(0));
  cursor.movePosition(QTextCursor::EndOfBlock);
  cursor.insertText(u" ' nota _"_qs);
  EXPECT_EQ(document->findBlockByNumber(0).userState(), VbHighlighter::kInComment);
  ASSERT_EQ(document->findBlockByNumber(1).layout()->formats().size(), 1);
  EXPECT_EQ(document->findBlockByNumber(1).layout()->formats().front().length, 5)
      << "the next line became comment";
  EXPECT_TRUE(document->findBlockByNumber(2).layout()->formats().isEmpty());
}

}  // namespace
}  // namespace desktop
