// SPDX-License-Identifier: MIT
// The control property defaults dialog, shown for each control added while the option is on: a short list
// of the properties that matter for the control's class, typed or picked from a drop-down list, written to
// the control as each box is left and again on OK; and two choices for generated code: Enter as Tab, and
// a back colour while the control has the focus.
#pragma once

#include "common/options.h"
#include "designer/dialogparts.h"
#include "designer/properties.h"
#include "ide/vbide.h"

#include <QDialog>

#include <array>

class QCheckBox;
class QLineEdit;
class QListWidget;
class QPushButton;
class QToolButton;

namespace designer {

/// Rows are built once, when the dialog is first shown. Closing it in any way but OK sets Cancelled.
class frmProps final : public QDialog {
  Q_OBJECT

 public:
  static constexpr int kRows = 8;

  /// `Control` is the control being edited; the focus colour starts from the option globals; message
  /// boxes go through `ui`.
  frmProps(ide::Ref<ide::VBControl> control, const common::Options& options, ide::UserInterface& ui,
           QWidget* parent = nullptr);

  // What the caller reads afterwards.
  bool Cancelled() const { return m_cancelled; }
  bool EnterAsTab() const { return m_enterAsTab; }
  bool BackColorOnFocus() const { return m_backColorOnFocus; }
  const QString& FocusColor() const { return m_focusColor; }
  const CVBCTProperties& properties() const { return m_properties; }

  // The dialog's controls, by their names.
  QLabel* lblProp(int row) const { return m_lblProp.at(size_t(row)); }
  QLineEdit* txtValor(int row) const { return m_txtValor.at(size_t(row)); }
  QToolButton* cmdSeta() const { return m_cmdSeta; }
  QListWidget* lstColeta() const { return m_lstColeta; }
  QCheckBox* ckEnterTab() const { return m_ckEnterTab; }
  QCheckBox* ckBackColor() const { return m_ckBackColor; }
  QLineEdit* txtCor() const { return m_txtCor; }
  QPushButton* cmdCor() const { return m_cmdCor; }
  QPushButton* cmdOK() const { return m_cmdOK; }
  QPushButton* cmdCancel() const { return m_cmdCancel; }
  /// Replaces the system's colour dialog (scripts and tests).
  void setColourChooser(ColourChooser chooser) { m_chooseColour = std::move(chooser); }

 protected:
  void showEvent(QShowEvent* event) override;
  bool eventFilter(QObject* watched, QEvent* event) override;
  void done(int result) override;

 private:
  void Form_Activate();
  void EncheLista(const CVBCTProperty& row);
  void txtValor_GotFocus(int row);
  void txtValor_LostFocus(int row);
  /// The free-text row's box written to its value and to the control; false (and the row as it was)
  /// when the text is no value of the property or the control refuses it.
  bool commitRow(int row);
  /// Writes the value to the control's property, unless the property holds it already.
  void writeProperty(const QString& name, const QVariant& value);
  /// Writes a row's value; raises the failure in the dialog's language.
  void writeRow(const CVBCTProperty& row);
  /// Writes the Name and Index rows together, in the order that lets a control join a control array;
  /// on a failure the control keeps its name and index, and the failure is raised in the dialog's
  /// language.
  void writeIdentity();
  void cmdSeta_Click();
  void lstColeta_Click(int item);
  /// The list closed: hidden, and the focus back in its row's box.
  void closeList();
  void cmdCor_Click();
  void cmdOk_Click();
  void report(const std::exception& failure, const char* procedure, int line);
  int rowOf(QObject* box) const;
  bool isListRow(int row) const;

  ide::Ref<ide::VBControl> m_control;
  const common::Options& m_options;
  ide::UserInterface& m_ui;
  ColourChooser m_chooseColour = chooseSystemColour;

  bool m_cancelled = false;
  bool m_enterAsTab = false;
  bool m_backColorOnFocus = false;
  QString m_focusColor;
  CVBCTProperties m_properties;
  bool m_filling = false;   // EncheLista runs: list clicks are not the user's
  bool m_arrowKey = false;  // the Down key opens the list: the boxes' focus handlers stand aside
  bool m_built = false;
  int m_editingRow = -1;  // the box that has the focus, whose lost-focus step is still due
  int m_listRow = -1;     // the row the arrow button and the list belong to

  std::array<QLabel*, kRows> m_lblProp{};
  std::array<QLineEdit*, kRows> m_txtValor{};
  QToolButton* m_cmdSeta;
  QListWidget* m_lstColeta;
  QCheckBox* m_ckEnterTab;
  QCheckBox* m_ckBackColor;
  QLineEdit* m_txtCor;
  QPushButton* m_cmdCor;
  QPushButton* m_cmdOK;
  QPushButton* m_cmdCancel;
};

}  // namespace designer
