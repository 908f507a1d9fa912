// SPDX-License-Identifier: MIT
// Tools ▸ Options: the Editor Format page, where the colours of each kind of code text are chosen as in the
// IDE (Automatic or one of the sixteen palette colours, foreground and background) with a sample of the
// choice. OK applies them to every code window and remembers them in the settings.
#pragma once

#include "codecolours.h"

#include <QDialog>

#include <array>

class QComboBox;
class QLabel;
class QListWidget;
class QSettings;

namespace desktop {

class OptionsDialog final : public QDialog {
  Q_OBJECT

 public:
  /// `settings` (may be null) is where OK remembers the choice.
  explicit OptionsDialog(QSettings* settings, QWidget* parent = nullptr);

  void accept() override;

 private:
  void showKind(int row);
  void colourChosen();
  void updateSample();

  QSettings* m_settings;
  CodeColours::Scheme m_colours;
  QListWidget* m_kinds;
  QComboBox* m_foreground;
  QComboBox* m_background;
  QLabel* m_sample;
  bool m_showing = false;
};

}  // namespace desktop
