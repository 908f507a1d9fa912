// SPDX-License-Identifier: MIT
// The options dialog: switches each designer action, the number-and-indent option and the property
// defaults dialog on or off, and sets the focus colour. OK saves every option and reads the option
// globals again; Cancel and the close box change nothing.
#pragma once

#include "common/options.h"
#include "common/settings.h"
#include "designer/dialogparts.h"
#include "ide/platform.h"

#include <QDialog>

#include <array>

class QCheckBox;
class QLineEdit;
class QPushButton;

namespace designer {

class frmOptions final : public QDialog {
  Q_OBJECT

 public:
  /// The check boxes, in the order the dialog shows them.
  enum Option {
    ShowProperties,
    NumIndent,
    LabelTransp,
    TextBox1,
    FormPos,
    BorderStyle,
    SelTextBox,
    TextUcase,
    ControlRenamed,
    OptionCount
  };

  /// Message boxes go through `ui`; OK writes `settings` and then reads `options` again from them.
  frmOptions(common::SettingsStore& settings, common::Options& options, ide::UserInterface& ui,
             QWidget* parent = nullptr);

  QCheckBox* checkBox(Option option) const { return m_boxes.at(size_t(option)); }
  QLabel* label(Option option) const { return m_labels.at(size_t(option)); }
  QLineEdit* txtCor() const { return m_txtCor; }
  QPushButton* cmdCor() const { return m_cmdCor; }
  QPushButton* cmdOK() const { return m_cmdOK; }
  QPushButton* cmdCancel() const { return m_cmdCancel; }
  /// Replaces the system's colour dialog (scripts and tests).
  void setColourChooser(ColourChooser chooser) { m_chooseColour = std::move(chooser); }

 private:
  void Form_Activate();
  void cmdCor_Click();
  void cmdOK_Click();

  common::SettingsStore& m_settings;
  common::Options& m_options;
  ide::UserInterface& m_ui;
  ColourChooser m_chooseColour = chooseSystemColour;

  std::array<QCheckBox*, OptionCount> m_boxes{};
  std::array<QLabel*, OptionCount> m_labels{};
  QLineEdit* m_txtCor;
  QPushButton* m_cmdCor;
  QPushButton* m_cmdOK;
  QPushButton* m_cmdCancel;
};

}  // namespace designer
