// SPDX-License-Identifier: MIT
// The IDE's main window over the model: menu bar and toolbars drawn from the command bars, code and
// designer windows in an MDI area, the project window, the properties window, the toolbox and the
// Immediate window in docks,
// the caret position and the IDE mode in the status bar. The window follows the model (title, mode, the
// active window) and reports to it where the keyboard focus is.
#pragma once

#include "host/model/vbe.h"
#include "ide/signal.h"

#include <QMainWindow>
#include <QPointer>

#include <memory>
#include <vector>

class QDockWidget;
class QLabel;
class QMdiArea;
class QPlainTextEdit;
class QSettings;

namespace desktop {

class CommandBarView;
class IdeCommands;
class ProjectExplorer;
class PropertiesView;
class QtUserInterface;
class Toolbox;
class WindowManager;

struct MainWindowOptions {
  /// Where the window keeps its geometry, last folder and add-in choices; empty: nothing is remembered.
  QString settingsPath;
  /// The size the window opens with; scripts fix it so that their screenshots do not depend on the screen.
  QSize size = QSize(1280, 800);
  bool fitToScreen = true;
};

class MainWindow final : public QMainWindow {
  Q_OBJECT

 public:
  MainWindow(std::shared_ptr<host::VbeImpl> vbe, QtUserInterface& ui, MainWindowOptions options = {});
  ~MainWindow() override;

  const std::shared_ptr<host::VbeImpl>& vbe() const { return m_vbe; }
  QtUserInterface& ui() { return m_ui; }
  CommandBarView& commandBars() { return *m_bars; }
  WindowManager& windows() { return *m_windows; }
  ProjectExplorer& explorer() { return *m_explorer; }
  PropertiesView& properties() { return *m_properties; }
  Toolbox& toolbox() { return *m_toolbox; }
  QPlainTextEdit* immediate() const { return m_immediate; }
  IdeCommands& commands() { return *m_commands; }
  QMdiArea* mdiArea() const { return m_mdi; }
  /// The remembered settings, or null when nothing is remembered.
  QSettings* settings() const { return m_settings.get(); }

  /// Shows a message in the status bar until the next one.
  void showStatus(const QString& message, int timeoutMs = 0);
  /// Reports a failure in a message box over the window.
  void reportError(const QString& message);
  /// Closes without asking about unsaved changes (scripts, which save explicitly).
  void closeWithoutPrompt();
  /// Restores the remembered geometry and toolbar layout (after the add-ins added their toolbars).
  void restoreLayout();
  /// The command bar that a code window's context menu shows in the current mode.
  QString codeWindowMenuName() const;

 protected:
  void closeEvent(QCloseEvent* event) override;

 private:
  void buildDocks();
  void updateTitle();
  void updateProperties();
  void focusChanged(QWidget* now);
  /// A window with the focus lost it: when it was a dialog that closed, the window under it is activated.
  void activateUnder(QWidget* closed);
  void showCodeMenu(const QPoint& position);
  void showProjectMenu(const QPoint& position);
  void addControl(const QString& className);

  std::shared_ptr<host::VbeImpl> m_vbe;
  QtUserInterface& m_ui;
  std::unique_ptr<QSettings> m_settings;
  QMdiArea* m_mdi;
  CommandBarView* m_bars;
  WindowManager* m_windows;
  ProjectExplorer* m_explorer;
  PropertiesView* m_properties;
  Toolbox* m_toolbox;
  IdeCommands* m_commands;
  QDockWidget* m_explorerDock;
  QDockWidget* m_propertiesDock;
  QDockWidget* m_toolboxDock;
  QDockWidget* m_immediateDock;
  QPlainTextEdit* m_immediate;
  QLabel* m_position;
  QLabel* m_mode;
  std::vector<ide::Connection> m_connections;
  bool m_promptOnClose = true;
  bool m_shutDown = false;

  friend class IdeCommands;
};

}  // namespace desktop
