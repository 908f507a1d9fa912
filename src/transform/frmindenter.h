// SPDX-License-Identifier: MIT
// The indentation dialog: re-indents the procedure at the caret, the selected module or the active
// project with tabs or a number of spaces per level, and with the one-command option on numbers the code
// at the same time through number-and-indent.
#pragma once

#include "common/options.h"
#include "common/settings.h"
#include "ide/signal.h"
#include "ide/vbide.h"
#include "transform/dialogparts.h"
#include "transform/numindent.h"
#include "walk/walk.h"

#include <QDialog>

#include <array>
#include <memory>
#include <optional>

class QGroupBox;
class QProgressBar;
class QPushButton;
class QRadioButton;

namespace transform {

/// Idle → Running (Indent disabled, "&Cancelar") → the dialog closes itself at the end of the run.
/// Cancel during a run ends the walk at its next yield. The unit and the choice of tabs or spaces are
/// read from the settings when the dialog opens and written back when it closes.
class frmIndenter final : public QDialog {
  Q_OBJECT

 public:
  /// `options` are the add-in's option globals: the one-command option is read from them at each run.
  frmIndenter(ide::Ref<ide::VBE> vbe, common::SettingsStore& settings, const common::Options& options,
              QWidget* parent = nullptr);
  ~frmIndenter() override;

  /// 0 project, 1 module, 2 procedure.
  QRadioButton* opIndent(int index) const { return m_opIndent.at(size_t(index)); }
  /// 0 tabs, 1 spaces.
  QRadioButton* opSpaces(int index) const { return m_opSpaces.at(size_t(index)); }
  QLineEdit* txtSpaces() const { return m_txtSpaces; }
  QPushButton* cmdIndent() const { return m_cmdIndent; }
  QPushButton* cmdCancel() const { return m_cmdCancel; }
  QProgressBar* ProgBar() const { return m_progBar; }
  QGroupBox* frIndent() const { return m_frIndent; }
  QGroupBox* frUse() const { return m_frUse; }

  /// Spaces (true) or tabs are chosen.
  bool spaceMode() const;
  /// A run is going on.
  bool running() const { return m_running; }
  bool cancelled() const { return m_context.cancelled(); }

 protected:
  void done(int result) override;

 private:
  void opSpaces_Click(int index);
  void cmdIndent_Click();
  void cmdCancel_Click();
  void cancelRun();
  void walk(walk::PROG_MODE scope, qint32 unit);
  walk::PROG_MODE scope() const;
  void Form_Unload();

  ide::Ref<ide::VBE> m_vbe;
  common::SettingsStore& m_settings;
  const common::Options& m_options;

  std::array<QRadioButton*, 3> m_opIndent{};
  std::array<QRadioButton*, 2> m_opSpaces{};
  QLineEdit* m_txtSpaces;
  QPushButton* m_cmdIndent;
  QPushButton* m_cmdCancel;
  QProgressBar* m_progBar;
  QGroupBox* m_frIndent;
  QGroupBox* m_frUse;

  ProgressBarSink m_bar;
  walk::WalkContext m_context;
  std::unique_ptr<CNumIndent> m_numIndent;
  ide::Connection m_numIndentError;
  bool m_running = false;
  bool m_closeAfterRun = false;
};

}  // namespace transform
