// SPDX-License-Identifier: MIT
// The line-numbering dialog: adds line numbers to, or removes them from, the procedure at the caret, the
// selected module or the active project, and with the one-command option on hands the run to
// number-and-indent.
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
class QLabel;
class QProgressBar;
class QPushButton;
class QRadioButton;

namespace transform {

/// Idle (bar hidden, Add and Remove enabled, "&Fechar") → Running (bar shown, both disabled,
/// "&Cancelar") → a second after the run the dialog closes itself. Cancel during a run ends the walk at
/// its next yield and closes the dialog; so does closing the window. Message boxes go through the IDE's
/// user interface. The start number and interval are read from the settings when the dialog opens and
/// written back when it closes, where a box holds a number that differs from the stored one.
class frmLinNumbers final : public QDialog {
  Q_OBJECT

 public:
  /// `options` are the add-in's option globals: the one-command option is read from them at each run.
  frmLinNumbers(ide::Ref<ide::VBE> vbe, common::SettingsStore& settings, const common::Options& options,
                QWidget* parent = nullptr);
  ~frmLinNumbers() override;

  // The dialog's controls, by their names.
  QLineEdit* txtInitial() const { return m_txtInitial; }
  QLineEdit* txtInterval() const { return m_txtInterval; }
  /// 0 project, 1 module, 2 procedure.
  QRadioButton* opNumbers(int index) const { return m_opNumbers.at(size_t(index)); }
  QPushButton* cmdAdd() const { return m_cmdAdd; }
  QPushButton* cmdRemove() const { return m_cmdRemove; }
  QPushButton* cmdCancel() const { return m_cmdCancel; }
  QProgressBar* ProgBar() const { return m_progBar; }
  QGroupBox* frOptions() const { return m_frOptions; }
  QLabel* lblStartNum() const { return m_lblStartNum; }
  QLabel* lblInterval() const { return m_lblInterval; }

  /// The values the next run uses (and the last one used).
  qint32 startNumber() const { return m_startNumber; }
  qint32 interval() const { return m_interval; }
  /// A walk is going on (the wait after it is not part of it).
  bool running() const { return m_running; }
  /// The run's cancel flag.
  bool cancelled() const { return m_context.cancelled(); }

 protected:
  void done(int result) override;

 private:
  void cmdAdd_Click() { run(true); }
  void cmdRemove_Click() { run(false); }
  void cmdCancel_Click();
  void cancelRun();
  void run(bool add);
  void walk(walk::PROG_MODE scope, bool add);
  bool readBox(QLineEdit* box, qint32& field, int messageId);
  walk::PROG_MODE scope() const;
  void closeAfterWait();
  void backToIdle();
  void killCloseTimer();
  void Form_Unload();

  ide::Ref<ide::VBE> m_vbe;
  common::SettingsStore& m_settings;
  const common::Options& m_options;

  QLineEdit* m_txtInitial;
  QLineEdit* m_txtInterval;
  std::array<QRadioButton*, 3> m_opNumbers{};
  QPushButton* m_cmdAdd;
  QPushButton* m_cmdRemove;
  QPushButton* m_cmdCancel;
  QProgressBar* m_progBar;
  QGroupBox* m_frOptions;
  QLabel* m_lblStartNum;
  QLabel* m_lblInterval;

  qint32 m_startNumber = 0;
  qint32 m_interval = 0;
  ProgressBarSink m_bar;
  walk::WalkContext m_context;
  std::unique_ptr<CNumIndent> m_numIndent;
  ide::Connection m_numIndentError;
  std::optional<BusyCursor> m_cursor;
  bool m_running = false;
  bool m_closeAfterRun = false;
  int m_closeTimer = 0;
};

}  // namespace transform
