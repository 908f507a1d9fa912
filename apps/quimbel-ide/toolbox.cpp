// SPDX-License-Identifier: MIT
#include "toolbox.h"

#include "icons.h"

#include <QGridLayout>
#include <QToolButton>

namespace desktop {

const QStringList& Toolbox::controlClasses() {
  static const QStringList classes = {
      QStringLiteral("PictureBox"),   QStringLiteral("Label"),         QStringLiteral("TextBox"),
      QStringLiteral("Frame"),        QStringLiteral("CommandButton"), QStringLiteral("CheckBox"),
      QStringLiteral("OptionButton"), QStringLiteral("ComboBox"),      QStringLiteral("ListBox"),
      QStringLiteral("HScrollBar"),   QStringLiteral("VScrollBar"),    QStringLiteral("Timer"),
      QStringLiteral("DriveListBox"), QStringLiteral("DirListBox"),    QStringLiteral("FileListBox"),
      QStringLiteral("Shape"),        QStringLiteral("Line"),          QStringLiteral("Image")};
  return classes;
}

Toolbox::Toolbox(QWidget* parent) : QWidget(parent) {
  setObjectName(QStringLiteral("toolbox"));
  auto* layout = new QGridLayout(this);
  layout->setContentsMargins(3, 3, 3, 3);
  layout->setSpacing(1);
  auto* pointer = new QToolButton(this);
  pointer->setIcon(controlIcon(QStringLiteral("Pointer")));
  pointer->setIconSize(QSize(22, 22));
  pointer->setToolTip(QStringLiteral("Pointer"));
  pointer->setAutoRaise(true);
  pointer->setCheckable(true);
  pointer->setChecked(true);
  layout->addWidget(pointer, 0, 0);
  int index = 1;
  for (const QString& className : controlClasses()) {
    auto* button = new QToolButton(this);
    button->setObjectName(QStringLiteral("tool_") + className);
    button->setIcon(controlIcon(className));
    button->setIconSize(QSize(22, 22));
    button->setToolTip(className);
    button->setAutoRaise(true);
    connect(button, &QToolButton::clicked, this, [this, className] { Q_EMIT controlWanted(className); });
    layout->addWidget(button, index / 2, index % 2);
    ++index;
  }
  layout->setRowStretch(index / 2 + 1, 1);
}

bool Toolbox::click(const QString& className) {
  for (const QString& known : controlClasses()) {
    if (known.compare(className, Qt::CaseInsensitive) != 0) continue;
    if (auto* button = findChild<QToolButton*>(QStringLiteral("tool_") + known)) {
      button->click();
      return true;
    }
  }
  return false;
}

}  // namespace desktop
