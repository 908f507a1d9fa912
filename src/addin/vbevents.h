// SPDX-License-Identifier: MIT
// CVBEvents holds every event sink of the add-in: the clicks of its toolbar buttons, popup menu items and
// code-window context-menu items, and the IDE's project, component, control, selected-control, file and
// reference events. Each handler checks the command state or the IDE's mode and hands over to one feature.
// Releasing the object disconnects every sink: the click sinks first, then the IDE's.
#pragma once

#include "addin/commandtable.h"
#include "addin/envutils.h"
#include "addin/subclass.h"
#include "ide/vbide.h"

#include <QString>

#include <array>
#include <memory>
#include <source_location>
#include <vector>

namespace addin {

class Globals;
class AddInControls;

class CVBEvents {
 public:
  explicit CVBEvents(Globals& globals);
  ~CVBEvents();
  CVBEvents(const CVBEvents&) = delete;
  CVBEvents& operator=(const CVBEvents&) = delete;

  /// Connects the click sinks of the popup, its items and the context-menu items; fails (error
  /// 0x80040C81, "Não há menu de Add-Ins.") when the IDE has no "Add-Ins" bar. False releases them.
  void ConnectMenus(bool connect);
  /// Button k of the toolbar goes to the k-th toolbar command of the table.
  void ConnectToolBarEvents(const ide::Ref<ide::CommandBar>& toolbar);
  void NullifyToolBarEvents();
  /// Connects (or releases) the project events, the component, file and reference events of the active
  /// project and the control events of the selected component's form. Failures are ignored.
  void UpdateEventHandlers(bool connect);
  /// Follows the form designer in front with the control sinks (the timer calls it while a designer is
  /// active; it reconnects only when the form changed).
  void connectControlEvents(const ide::Ref<ide::VBComponent>& component);

  // Command handlers, in table order (each checks its command-state entry first, see runCommand).
  void EvButtonBrowseBackward_Click();
  void EvButtonBrowseForward_Click();
  void EvButtonFavorites_Click();
  void EvButtonMacros_Click();
  void EvButtonCopyBuffers_Click();
  void EvButtonLinesNumbering_Click();
  void EvButtonIndentation_Click();
  void EvButtonCloseWindows_Click();
  void EvButtonExtendedFind_Click();
  void EvButtonTaskList_Click();
  void EvButtonNewProcedure_Click();
  void EvButtonOptions_Click();
  void EvMnuQMHelpHandler_Click();
  void EvMnuAddToFavoritesDsg_Click();
  void EvMnuAddToFavoritesBrk_Click();

  /// A click on a command of the table: nothing when its command-state entry is false; failures end
  /// silently.
  void runCommand(const CommandEntry& command);

  // IDE events.
  void EvProjectsHandler_ItemAdded(const ide::Ref<ide::VBProject>& project);
  void EvProjectsHandler_ItemRemoved(const ide::Ref<ide::VBProject>& project);
  void EvProjectsHandler_ItemRenamed(const ide::Ref<ide::VBProject>& project, const QString& oldName);
  void EvProjectsHandler_ItemActivated(const ide::Ref<ide::VBProject>& project);
  void EvComponentsHandler_ItemAdded(const ide::Ref<ide::VBComponent>& component);
  void EvComponentsHandler_ItemRemoved(const ide::Ref<ide::VBComponent>& component);
  void EvComponentsHandler_ItemRenamed(const ide::Ref<ide::VBComponent>& component, const QString& oldName);
  void EvComponentsHandler_ItemActivated(const ide::Ref<ide::VBComponent>& component);
  void EvComponentsHandler_ItemSelected(const ide::Ref<ide::VBComponent>& component);
  void EvControlsHandler_ItemAdded(const ide::Ref<ide::VBControl>& control);
  void EvControlsHandler_ItemRenamed(const ide::Ref<ide::VBControl>& control, const QString& oldName,
                                     int oldIndex);
  void EvFileControlHandler_AfterChangeFileName(const ide::Ref<ide::VBProject>& project, ide::FileType type,
                                                const QString& newName, const QString& oldName);

 private:
  /// The sinks of one project: its components, its files and its references.
  void connectProjectEvents(const ide::Ref<ide::VBProject>& project);
  void componentActivatedOrSelected(const ide::Ref<ide::VBComponent>& component);
  void componentRemoved(const ide::Ref<ide::VBComponent>& component);
  bool running();
  /// The handler's failure, recorded with its location and shown by ShowErrorReport.
  void reportFailure(const std::exception& failure, const char* procedure, std::source_location where);
  /// The handler's failure, shown as "Erro indeterminado." (and logged with its location).
  void reportUndetermined(const std::exception& failure, const char* procedure, std::source_location where);
  /// A failure the handler ends on silently: only logged with its location.
  static void logIgnored(const std::exception& failure, const char* procedure,
                         std::source_location where = std::source_location::current());
  qintptr idleProcedure(ide::HWnd window, unsigned message, quintptr wParam, qintptr lParam);

  Globals& m_globals;
  ide::VBE& m_vbe;

  // IDE sinks.
  std::vector<ide::Connection> m_projectsHandler;
  std::vector<ide::Connection> m_componentsHandler;
  std::vector<ide::Connection> m_fileControlHandler;
  ide::Ref<ide::ReferencesEventSource> m_referencesHandler;  // connected; its events need no action
  std::vector<ide::Connection> m_controlsHandler;
  ide::Ref<ide::SelectedControlsEventSource> m_selControlsHandler;  // likewise
  std::weak_ptr<ide::VBForm> m_controlsForm;
  // The main window's one-shot idle procedure, while a project addition waits for the IDE to be idle.
  ide::WndProcRef m_idleProc;
  std::unique_ptr<SubclassedWindow> m_idleSubclass;

  // Click sinks (released first).
  std::array<ide::Connection, kToolBarButtons> m_toolBarButtons;
  ide::Connection m_mnuQuimbelHandler;
  std::vector<ide::Connection> m_menuItems;
  ide::Connection m_mnuAddToFavoritesDsg;
  ide::Connection m_mnuAddToFavoritesBrk;
};

}  // namespace addin
