// SPDX-License-Identifier: MIT
// Pieces the options and property defaults dialogs share: a label that toggles its check box when
// clicked, and the choice of a colour in the system's colour dialog.
#pragma once

#include <QColor>
#include <QLabel>

#include <functional>
#include <optional>

class QCheckBox;

namespace designer {

/// A label beside a check box (which has no text of its own): a click on it toggles the box.
class ToggleLabel final : public QLabel {
  Q_OBJECT

 public:
  ToggleLabel(const QString& text, QCheckBox* box, QWidget* parent);

 protected:
  void mouseReleaseEvent(QMouseEvent* event) override;

 private:
  QCheckBox* m_box;
};

/// Asks for a colour over `owner`, starting from `initial`: the colour chosen, or nothing when the user
/// cancelled.
using ColourChooser = std::function<std::optional<QColor>(QWidget* owner, const QColor& initial)>;

/// The system's colour dialog: solid colours only, with its table of 16 custom colours.
std::optional<QColor> chooseSystemColour(QWidget* owner, const QColor& initial);

}  // namespace designer
