// SPDX-License-Identifier: MIT
#include "transform/dialogparts.h"

#include <QFocusEvent>
#include <QKeyEvent>
#include <QProgressBar>
#include <QRegularExpressionValidator>
#include <QTimer>

namespace transform {

using namespace walk;

NumberBox::NumberBox(QWidget* parent) : QLineEdit(parent) {
  // The validator stops typed letters; pasting is refused as a whole below, as the IDE's boxes do.
  setValidator(new QRegularExpressionValidator(QRegularExpression(QStringLiteral("[0-9]*")), this));
  setContextMenuPolicy(Qt::NoContextMenu);
  setAcceptDrops(false);
  setDragEnabled(false);
}

void NumberBox::keyPressEvent(QKeyEvent* event) {
  if (event->matches(QKeySequence::Paste) ||
      (event->key() == Qt::Key_Insert && event->modifiers() == Qt::ShiftModifier) ||
      (event->key() == Qt::Key_V && event->modifiers() == Qt::ControlModifier)) {
    event->accept();
    return;
  }
  QLineEdit::keyPressEvent(event);
}

void NumberBox::focusInEvent(QFocusEvent* event) {
  QLineEdit::focusInEvent(event);
  selectAll();
  // A mouse click that gave the focus places the caret after this event; select again once it has.
  if (event->reason() == Qt::MouseFocusReason) QTimer::singleShot(0, this, &QLineEdit::selectAll);
}

int ProgressBarSink::minimum() const {
  return m_bar.minimum();
}
void ProgressBarSink::setMinimum(int minimum) {
  m_bar.setMinimum(minimum);
}
int ProgressBarSink::maximum() const {
  return m_bar.maximum();
}
void ProgressBarSink::setMaximum(int maximum) {
  m_bar.setMaximum(maximum);
}
int ProgressBarSink::value() const {
  // An empty QProgressBar reports minimum - 1; the walks count from the minimum.
  return std::max(m_bar.value(), m_bar.minimum());
}
void ProgressBarSink::setValue(int value) {
  m_bar.setValue(value);
}
bool ProgressBarSink::isVisible() const {
  return !m_bar.isHidden();
}
void ProgressBarSink::setVisible(bool visible) {
  m_bar.setVisible(visible);
  m_bar.repaint();
}

QString walkFailureText(const QString& message, const WalkFailure& failure, ide::VBE& vbe, PROG_MODE scope) {
  QString module = failure.module;
  if (module.isEmpty() && failure.line > 0) {
    try {
      if (scope == PROG_PROCEDURE) module = activeCodePane(vbe)->CodeModule()->Name();
      if (scope == PROG_MODULE) module = selectedComponent(vbe)->Name();
    } catch (const std::exception&) {
      // The module left the IDE: the message goes without its name.
    }
  }
  QString text = message;
  if (!module.isEmpty()) {
    text += QStringLiteral("\n\nMódulo %1").arg(module);
    if (failure.line > 0) text += QStringLiteral(", linha %1").arg(failure.line);
    text += u'.';
  }
  // The IDE's own description is in English: the reasons a user can act on are said here.
  switch (failure.error.number()) {
    case ide::err::LineTooLong:
      text += QStringLiteral(" A linha passaria de 1023 caracteres.");
      break;
    default:
      text += QStringLiteral(" (erro %1)").arg(failure.error.number());
      break;
  }
  return text;
}

int walkMessageId(PROG_MODE scope, bool indenting) {
  switch (scope) {
    case PROG_PROJECT:
      return indenting ? 5130 : 5121;
    case PROG_MODULE:
      return indenting ? 5129 : 5122;
    default:
      return indenting ? 5128 : 5123;
  }
}

}  // namespace transform
