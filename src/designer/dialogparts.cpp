// SPDX-License-Identifier: MIT
#include "designer/dialogparts.h"

#include <QCheckBox>
#include <QColorDialog>
#include <QMouseEvent>

namespace designer {

ToggleLabel::ToggleLabel(const QString& text, QCheckBox* box, QWidget* parent)
    : QLabel(text, parent), m_box(box) {
  setBuddy(box);  // a mnemonic in the text moves to the box
}

void ToggleLabel::mouseReleaseEvent(QMouseEvent* event) {
  if (event->button() == Qt::LeftButton && rect().contains(event->position().toPoint()) &&
      m_box->isEnabled()) {
    m_box->setFocus(Qt::MouseFocusReason);
    m_box->click();  // as a click on the box: its clicked() handlers run
  }
  QLabel::mouseReleaseEvent(event);
}

std::optional<QColor> chooseSystemColour(QWidget* owner, const QColor& initial) {
  // Without the alpha channel the dialog offers solid colours only.
  const QColor chosen = QColorDialog::getColor(initial.isValid() ? initial : QColor(Qt::white), owner);
  if (!chosen.isValid()) return std::nullopt;
  return chosen;
}

}  // namespace designer
