// SPDX-License-Identifier: MIT
// The toolbox: one button per intrinsic control; a click adds that control to the active form designer.
#pragma once

#include <QWidget>

namespace desktop {

class Toolbox final : public QWidget {
  Q_OBJECT

 public:
  explicit Toolbox(QWidget* parent = nullptr);

  /// The classes offered, in the IDE's order ("PictureBox", "Label" ...).
  static const QStringList& controlClasses();
  /// Clicks the button of a class; false when there is none.
  bool click(const QString& className);

 Q_SIGNALS:
  void controlWanted(const QString& className);
};

}  // namespace desktop
