// SPDX-License-Identifier: MIT
#include "codeeditor.h"

#include "codecolours.h"
#include "host/platform/windowsystem.h"
#include "keys.h"
#include "vbfonts.h"
#include "vbhighlighter.h"

#include <QGuiApplication>
#include <QKeyEvent>
#include <QPainter>
#include <QScrollBar>
#include <QTextBlock>

#include <algorithm>

namespace desktop {

/// The grey bar left of the code, where the IDE shows breakpoints and the current statement.
class MarginBar final : public QWidget {
 public:
  explicit MarginBar(CodeEditor* editor) : QWidget(editor), m_editor(editor) {}
  QSize sizeHint() const override { return QSize(m_editor->marginWidth(), 0); }

 protected:
  void paintEvent(QPaintEvent* event) override { m_editor->paintMargin(event); }

 private:
  CodeEditor* m_editor;
};

CodeEditor::CodeEditor(QWidget* parent) : QPlainTextEdit(parent) {
  const QFont font = codeFont();
  setFont(font);
  setLineWrapMode(QPlainTextEdit::NoWrap);
  setTabStopDistance(QFontMetricsF(font).horizontalAdvance(u' ') * 4);
  setFrameShape(QFrame::NoFrame);
  m_margin = new MarginBar(this);
  setViewportMargins(kMarginWidth, 0, 0, 0);
  m_highlighter = new VbHighlighter(this);
  applyColours();
  connect(&CodeColours::instance(), &CodeColours::changed, this, &CodeEditor::applyColours);
  connect(verticalScrollBar(), &QScrollBar::valueChanged, this, [this] {
    m_highlighter->colourVisible();
    m_margin->update();
  });
}

CodeEditor::~CodeEditor() = default;

void CodeEditor::applyColours() {
  const CodeColours& colours = CodeColours::instance();
  QPalette colouring = palette();
  for (const QPalette::ColorGroup group : {QPalette::Active, QPalette::Inactive}) {
    colouring.setColor(group, QPalette::Text, colours.foreground(CodeText::Normal));
    colouring.setColor(group, QPalette::Base, colours.background(CodeText::Normal));
    colouring.setColor(group, QPalette::Highlight, colours.background(CodeText::Selection));
    colouring.setColor(group, QPalette::HighlightedText, colours.foreground(CodeText::Selection));
  }
  setPalette(colouring);
}

void CodeEditor::setHotKeyTarget(host::WindowSystemImpl* windows, std::function<ide::HWnd()> window) {
  m_windows = windows;
  m_window = std::move(window);
}

namespace {

NativeKeyCodes nativeKeyCodes() {
  static const NativeKeyCodes codes = nativeKeyCodesOf(QGuiApplication::platformName());
  return codes;
}

}  // namespace

bool CodeEditor::isRegisteredHotKey(QKeyEvent* event) const {
  if (!m_windows || !m_window) return false;
  const VirtualKey key = virtualKeyOf(*event, nativeKeyCodes());
  return key.key != 0 && m_windows->hasHotKey(m_window(), key.modifiers, key.key);
}

namespace {

/// Keys that only move the caret or do nothing to the text; every other key may change or copy text.
bool onlyMoves(const QKeyEvent* event) {
  switch (event->key()) {
    case Qt::Key_Left:
    case Qt::Key_Right:
    case Qt::Key_Up:
    case Qt::Key_Down:
    case Qt::Key_Home:
    case Qt::Key_End:
    case Qt::Key_PageUp:
    case Qt::Key_PageDown:
    case Qt::Key_Shift:
    case Qt::Key_Control:
    case Qt::Key_Alt:
    case Qt::Key_Meta:
    case Qt::Key_Escape:
      return true;
    default:
      return event->key() >= Qt::Key_F1 && event->key() <= Qt::Key_F35;
  }
}

}  // namespace

bool CodeEditor::event(QEvent* event) {
  if (event->type() == QEvent::ShortcutOverride) {
    // A registered hotkey goes to the window's procedures before any menu shortcut can take it.
    if (isRegisteredHotKey(static_cast<QKeyEvent*>(event))) {
      event->accept();
      return true;
    }
  }
  return QPlainTextEdit::event(event);
}

void CodeEditor::keyPressEvent(QKeyEvent* event) {
  // A key that edits works on the module's latest text; one that only moves the caret need not wait for
  // a long run of the module's edits to be shown.
  if (m_beforeInput && !onlyMoves(event)) m_beforeInput();
  if (m_windows && m_window) {
    const VirtualKey key = virtualKeyOf(*event, nativeKeyCodes());
    if (key.key != 0 && m_windows->deliverHotKey(m_window(), key.modifiers, key.key)) {
      event->accept();
      return;
    }
  }
  QPlainTextEdit::keyPressEvent(event);
}

void CodeEditor::inputMethodEvent(QInputMethodEvent* event) {
  if (m_beforeInput) m_beforeInput();
  QPlainTextEdit::inputMethodEvent(event);
}

void CodeEditor::insertFromMimeData(const QMimeData* source) {
  if (m_beforeInput) m_beforeInput();
  QPlainTextEdit::insertFromMimeData(source);
}

void CodeEditor::contextMenuEvent(QContextMenuEvent* event) {
  Q_EMIT contextMenuWanted(event->globalPos());
  event->accept();
}

void CodeEditor::resizeEvent(QResizeEvent* event) {
  QPlainTextEdit::resizeEvent(event);
  const QRect area = contentsRect();
  m_margin->setGeometry(QRect(area.left(), area.top(), kMarginWidth, area.height()));
  m_highlighter->colourVisible();
}

void CodeEditor::setSeparators(std::vector<int> lines) {
  std::sort(lines.begin(), lines.end());
  if (lines == m_separators) return;
  m_separators = std::move(lines);
  viewport()->update();
}

void CodeEditor::showLines(int first, int last) {
  if (std::pair(first, last) == m_shown) return;
  m_shown = {first, last};
  const bool all = first <= 0 && last <= 0;
  for (QTextBlock block = document()->firstBlock(); block.isValid(); block = block.next()) {
    const int line = block.blockNumber() + 1;
    block.setVisible(all || (line >= first && line <= last));
  }
  // The layout learns of the hidden blocks only when their contents are marked changed.
  document()->markContentsDirty(0, document()->characterCount());
  viewport()->update();
  m_margin->update();
}

void CodeEditor::paintEvent(QPaintEvent* event) {
  QPlainTextEdit::paintEvent(event);
  // In the full module view a grey line parts each procedure from what stands above it.
  if (m_separators.empty() || m_shown != std::pair(0, 0)) return;
  QPainter painter(viewport());
  painter.setPen(QColor(0x80, 0x80, 0x80));
  const QPointF offset = contentOffset();
  for (QTextBlock block = firstVisibleBlock(); block.isValid(); block = block.next()) {
    const QRectF box = blockBoundingGeometry(block).translated(offset);
    if (box.top() > event->rect().bottom()) break;
    if (std::binary_search(m_separators.begin(), m_separators.end(), block.blockNumber() + 1))
      painter.drawLine(QPointF(0, box.top()), QPointF(viewport()->width(), box.top()));
  }
}

void CodeEditor::paintMargin(QPaintEvent* event) {
  QPainter painter(m_margin);
  painter.fillRect(event->rect(), QColor(0xe6, 0xe6, 0xe6));
  painter.setPen(QColor(0xb4, 0xb4, 0xb4));
  painter.drawLine(kMarginWidth - 1, event->rect().top(), kMarginWidth - 1, event->rect().bottom());
}

}  // namespace desktop
