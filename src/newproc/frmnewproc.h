// SPDX-License-Identifier: MIT
// The new-procedure wizard: writes a Sub, a Function or the Get, Let and Set of a property, with an error
// handler and a documentation header from two editable templates, into the module of the active code pane.
#pragma once

#include "common/settings.h"
#include "ide/vbide.h"
#include "newproc/procgen.h"

#include <QColor>
#include <QDialog>

#include <array>
#include <functional>

class QCheckBox;
class QComboBox;
class QGroupBox;
class QLabel;
class QLineEdit;
class QPlainTextEdit;
class QPushButton;
class QRadioButton;
class QTabWidget;

namespace appdata {
class CAppInfoFile;
}
namespace textins {
class TextInsertion;
}

namespace newproc {

/// What the wizard works with; all of it outlives the dialog.
struct NewProcServices {
  ide::Ref<ide::VBE> vbe;
  common::SettingsStore& settings;
  /// Where the templates are kept; null when the application database could not be opened.
  appdata::CAppInfoFile* appInfo = nullptr;
  /// What the user is told when there is no database.
  QString appInfoUnavailable;
  textins::TextInsertion& textInsertion;
  /// True while the IDE runs the program (its code windows are then read-only).
  std::function<bool()> programRunning;
  /// Opens the wizard's help page.
  std::function<void()> showHelp;
};

/// Opens the wizard modally over `parent` (the IDE's window when null) and returns when it closes. Without
/// an active code pane nothing opens; while the program runs, or without the application database, the
/// user is told why and nothing opens.
void showNewProcedureDialog(const NewProcServices& services, QWidget* parent = nullptr);

/// The dialog. The kind, scope and property rules enable the controls as the user goes; OK validates,
/// writes the templates back when they were edited, writes the procedure and asks whether to create
/// another. The two template options are read from the settings when the dialog opens and written back
/// when it closes. Message boxes go through the IDE's user interface.
class frmNewProc final : public QDialog {
  Q_OBJECT

 public:
  /// `services.appInfo` must not be null. Raises what reading the templates raised.
  explicit frmNewProc(const NewProcServices& services, QWidget* parent = nullptr);
  ~frmNewProc() override;

  /// Closes at once, without showing itself, when there was no active code pane at load.
  int exec() override;

  // The dialog's controls, by their names.
  QTabWidget* tabNewProc() const { return m_tabNewProc; }
  QLineEdit* txtName() const { return m_txtName; }
  /// 0 Sub, 1 Function, 2 Property.
  QRadioButton* opType(int index) const { return m_opType.at(size_t(index)); }
  /// 0 Private, 1 Public, 2 Friend.
  QRadioButton* opScope(int index) const { return m_opScope.at(size_t(index)); }
  QGroupBox* frPropProcs() const { return m_frPropProcs; }
  QCheckBox* ckPropGet() const { return m_ckPropGet; }
  QCheckBox* ckPropLet() const { return m_ckPropLet; }
  QCheckBox* ckPropSet() const { return m_ckPropSet; }
  QLabel* lblMemberVar() const { return m_lblMemberVar; }
  QLineEdit* txtVariable() const { return m_txtVariable; }
  QLabel* lblType() const { return m_lblType; }
  QComboBox* cboDataType() const { return m_cboDataType; }
  QCheckBox* ckIsObject() const { return m_ckIsObject; }
  QCheckBox* ckStatic() const { return m_ckStatic; }
  QCheckBox* ckDefault() const { return m_ckDefault; }
  QCheckBox* ckErrHandler() const { return m_ckErrHandler; }
  QCheckBox* ckDocHeader() const { return m_ckDocHeader; }
  QPlainTextEdit* txtErrCode() const { return m_txtErrCode; }
  QPlainTextEdit* txtDocHeader() const { return m_txtDocHeader; }
  QPushButton* cmdOk() const { return m_cmdOk; }
  QPushButton* cmdCancel() const { return m_cmdCancel; }
  QPushButton* cmdHelp() const { return m_cmdHelp; }

  /// The object check box's caption is red: the reminder that the type may be an object.
  bool objectReminderShown() const;
  /// What the first page says now.
  NewProcChoices choices() const;

 protected:
  void done(int result) override;

 private:
  void buildControls();
  void loadTexts();
  void Form_Load();
  void Form_Unload();
  void tabNewProc_Click(int index);
  void opType_Click(int index);
  void txtName_Change();
  void cboDataType_Change(const QString& text);
  void ckIsObject_Click();
  void cmdOk_Click();
  void cmdHelp_Click();
  /// Sub, Function or Property chosen.
  ProcType kind() const;
  void chooseScopeAgain();
  void functionTypeRule();
  void propertyTypeRule();
  /// The index of `text` in the data-type list (whole item, any letter case), or -1.
  int SearchListString(const QString& text) const;
  void setObjectReminder(bool shown);
  void refuse(const Refusal& refusal);
  void writeTemplates(const QString& errorHandler, const QString& docHeader);
  void readyForNext();

  NewProcServices m_services;
  appdata::CAppInfoFile& m_appInfo;
  bool m_noCodePane = false;
  QString m_loadedErrorHandler;
  QString m_loadedDocHeader;
  QColor m_objectColor;

  QTabWidget* m_tabNewProc = nullptr;
  std::array<QWidget*, 3> m_frNewProc{};
  QLabel* m_lblName = nullptr;
  QLineEdit* m_txtName = nullptr;
  QGroupBox* m_frProcType = nullptr;
  std::array<QRadioButton*, 3> m_opType{};
  QGroupBox* m_frScope = nullptr;
  std::array<QRadioButton*, 3> m_opScope{};
  QGroupBox* m_frPropProcs = nullptr;
  QCheckBox* m_ckPropGet = nullptr;
  QCheckBox* m_ckPropLet = nullptr;
  QCheckBox* m_ckPropSet = nullptr;
  QLabel* m_lblMemberVar = nullptr;
  QLineEdit* m_txtVariable = nullptr;
  QLabel* m_lblType = nullptr;
  QComboBox* m_cboDataType = nullptr;
  QCheckBox* m_ckIsObject = nullptr;
  QCheckBox* m_ckStatic = nullptr;
  QCheckBox* m_ckDefault = nullptr;
  QCheckBox* m_ckErrHandler = nullptr;
  QCheckBox* m_ckDocHeader = nullptr;
  QLabel* m_lblEnterEH = nullptr;
  QPlainTextEdit* m_txtErrCode = nullptr;
  QLabel* m_lblEnterDocH = nullptr;
  QPlainTextEdit* m_txtDocHeader = nullptr;
  QPushButton* m_cmdOk = nullptr;
  QPushButton* m_cmdCancel = nullptr;
  QPushButton* m_cmdHelp = nullptr;
};

}  // namespace newproc
