// SPDX-License-Identifier: MIT
#include "addin/vbevents.h"

#include "addin/globals.h"
#include "addin/help.h"
#include "addin/texts.h"
#include "common/errors.h"
#include "common/strings.h"

#include <QFileInfo>

namespace addin {
namespace {

/// The COM object-error base plus 3000 plus the string number, as a 32-bit error number.
constexpr long kNoAddInsMenuError = static_cast<qint32>(0x80040000u + 3000u + 201u);

const char kModule[] = "CVBEvents";

/// Each Click handler of the IDE's click event gets the control and two flags it leaves as they are.
using ClickHandler = std::function<void()>;
ide::Connection connectClick(ide::VBE& vbe, const ide::Ref<ide::CommandBarControl>& control,
                             ClickHandler handler) {
  return vbe.Events()->CommandBarEvents(control)->Click.connect(
      [handler = std::move(handler)](const ide::Ref<ide::CommandBarControl>&, bool&, bool&) { handler(); });
}

}  // namespace

CVBEvents::CVBEvents(Globals& globals)
    : m_globals(globals),
      m_vbe(globals.vbe()),
      m_idleProc(std::make_shared<const ide::WndProc>(
          [this](ide::HWnd window, unsigned message, quintptr wParam, qintptr lParam) {
            return idleProcedure(window, message, wParam, lParam);
          })) {}

CVBEvents::~CVBEvents() = default;

// ---------------------------------------------------------------------------------------------------
// Connecting

void CVBEvents::ConnectMenus(bool connect) {
  m_mnuQuimbelHandler.disconnect();
  m_menuItems.clear();
  m_mnuAddToFavoritesDsg.disconnect();
  m_mnuAddToFavoritesBrk.disconnect();
  if (!connect) return;

  try {
    m_vbe.CommandBars()->Item(QStringLiteral("Add-Ins"));
  } catch (const ide::Error&) {
    throw common::recordError(ide::Error(kNoAddInsMenuError, common::LoadResString(kNoAddInsMenuText)),
                              QString::fromLatin1(kModule), QStringLiteral("ConnectMenus"), __LINE__);
  }
  AddInControls& controls = m_globals.controls();
  m_mnuQuimbelHandler = connectClick(m_vbe, controls.popup.get(), [] {});
  size_t item = 0;
  for (const CommandEntry& command : commandTable()) {
    if (!(command.placement & OnPopup)) continue;
    // A menu item does what the toolbar button of the same command does.
    m_menuItems.push_back(
        connectClick(m_vbe, controls.menuItems.at(item++).get(), [this, &command] { runCommand(command); }));
  }
  m_mnuAddToFavoritesDsg =
      connectClick(m_vbe, controls.contextItems[0].get(), [this] { EvMnuAddToFavoritesDsg_Click(); });
  m_mnuAddToFavoritesBrk =
      connectClick(m_vbe, controls.contextItems[1].get(), [this] { EvMnuAddToFavoritesBrk_Click(); });
}

void CVBEvents::ConnectToolBarEvents(const ide::Ref<ide::CommandBar>& toolbar) {
  auto buttons = toolbar->Controls();
  int k = 0;
  for (const CommandEntry& command : commandTable()) {
    if (!(command.placement & OnToolBar)) continue;
    m_toolBarButtons.at(static_cast<size_t>(k)) =
        connectClick(m_vbe, buttons->Item(k + 1), [this, &command] { runCommand(command); });
    ++k;
  }
}

void CVBEvents::NullifyToolBarEvents() {
  for (ide::Connection& button : m_toolBarButtons)
    button.disconnect();
}

void CVBEvents::UpdateEventHandlers(bool connect) {
  m_projectsHandler.clear();
  m_componentsHandler.clear();
  m_fileControlHandler.clear();
  m_referencesHandler.reset();
  m_controlsHandler.clear();
  m_selControlsHandler.reset();
  m_controlsForm.reset();
  if (!connect) return;
  try {
    auto projects = m_vbe.Events()->VBProjectsEvents();
    m_projectsHandler.push_back(
        projects->ItemAdded.connect([this](auto& p) { EvProjectsHandler_ItemAdded(p); }));
    m_projectsHandler.push_back(
        projects->ItemRemoved.connect([this](auto& p) { EvProjectsHandler_ItemRemoved(p); }));
    m_projectsHandler.push_back(projects->ItemRenamed.connect(
        [this](auto& p, const QString& oldName) { EvProjectsHandler_ItemRenamed(p, oldName); }));
    m_projectsHandler.push_back(
        projects->ItemActivated.connect([this](auto& p) { EvProjectsHandler_ItemActivated(p); }));
  } catch (const std::exception& failure) {
    logIgnored(failure, "UpdateEventHandlers");
  }
  try {
    if (auto project = m_vbe.ActiveVBProject()) connectProjectEvents(project);
  } catch (const std::exception& failure) {
    logIgnored(failure, "UpdateEventHandlers");
  }
  try {
    if (auto component = m_vbe.SelectedVBComponent()) connectControlEvents(component);
  } catch (const std::exception& failure) {
    logIgnored(failure, "UpdateEventHandlers");
  }
}

void CVBEvents::connectProjectEvents(const ide::Ref<ide::VBProject>& project) {
  m_componentsHandler.clear();
  m_fileControlHandler.clear();
  m_referencesHandler.reset();
  auto events = m_vbe.Events();
  auto components = events->VBComponentsEvents(project);
  m_componentsHandler.push_back(
      components->ItemAdded.connect([this](auto& c) { EvComponentsHandler_ItemAdded(c); }));
  m_componentsHandler.push_back(
      components->ItemRemoved.connect([this](auto& c) { EvComponentsHandler_ItemRemoved(c); }));
  m_componentsHandler.push_back(components->ItemRenamed.connect(
      [this](auto& c, const QString& oldName) { EvComponentsHandler_ItemRenamed(c, oldName); }));
  m_componentsHandler.push_back(
      components->ItemActivated.connect([this](auto& c) { EvComponentsHandler_ItemActivated(c); }));
  m_componentsHandler.push_back(
      components->ItemSelected.connect([this](auto& c) { EvComponentsHandler_ItemSelected(c); }));
  m_fileControlHandler.push_back(events->FileControlEvents(project)->AfterChangeFileName.connect(
      [this](auto& p, ide::FileType type, const QString& newName, const QString& oldName) {
        EvFileControlHandler_AfterChangeFileName(p, type, newName, oldName);
      }));
  m_referencesHandler = events->ReferencesEvents(project);
}

void CVBEvents::connectControlEvents(const ide::Ref<ide::VBComponent>& component) {
  auto form = component->Designer();
  if (!form) return;
  if (m_controlsForm.lock() == form) return;
  m_controlsHandler.clear();
  m_selControlsHandler.reset();
  m_controlsForm.reset();
  auto project = component->Collection()->Parent();
  auto events = m_vbe.Events();
  auto controls = events->VBControlsEvents(project, form);
  m_controlsHandler.push_back(
      controls->ItemAdded.connect([this](auto& c) { EvControlsHandler_ItemAdded(c); }));
  m_controlsHandler.push_back(
      controls->ItemRenamed.connect([this](auto& c, const QString& oldName, int oldIndex) {
        EvControlsHandler_ItemRenamed(c, oldName, oldIndex);
      }));
  m_selControlsHandler = events->SelectedVBControlsEvents(project, form);
  m_controlsForm = form;
}

// ---------------------------------------------------------------------------------------------------
// Failure handling

void CVBEvents::reportFailure(const std::exception& failure, const char* procedure,
                              std::source_location where) {
  common::recordError(failure, QString::fromLatin1(kModule), QString::fromLatin1(procedure),
                      static_cast<int>(where.line()));
  common::ShowErrorReport(m_vbe.Platform().ui());
}

void CVBEvents::reportUndetermined(const std::exception& failure, const char* procedure,
                                   std::source_location where) {
  common::recordError(failure, QString::fromLatin1(kModule), QString::fromLatin1(procedure),
                      static_cast<int>(where.line()));
  common::logLastError();
  m_vbe.Platform().ui().MsgBox(QString::fromUtf16(kUndeterminedError), ide::mb::Critical, common::title());
}

void CVBEvents::logIgnored(const std::exception& failure, const char* procedure, std::source_location where) {
  common::logFailure(failure, QString::fromLatin1(kModule), QString::fromLatin1(procedure),
                     static_cast<int>(where.line()));
}

bool CVBEvents::running() {
  return m_globals.EnvUtils().IdeMode() == ide::IdeMode::Run;
}

// ---------------------------------------------------------------------------------------------------
// Commands

void CVBEvents::runCommand(const CommandEntry& command) {
  if (command.gated && !m_globals.CommandState()[command.id]) return;
  try {
    (this->*command.handler)();
  } catch (const std::exception& failure) {
    // Command handlers end silently.
    logIgnored(failure, "runCommand");
  }
}

void CVBEvents::EvButtonBrowseBackward_Click() {
  m_globals.Histories().Browse(navigation::BD_BACKWARD);
}

void CVBEvents::EvButtonBrowseForward_Click() {
  m_globals.Histories().Browse(navigation::BD_FORWARD);
}

void CVBEvents::EvButtonFavorites_Click() {
  m_globals.features().showFavorites();
}

void CVBEvents::EvButtonMacros_Click() {
  m_globals.features().showMacros();
}

void CVBEvents::EvButtonCopyBuffers_Click() {
  m_globals.features().showCopyBuffers();
}

void CVBEvents::EvButtonLinesNumbering_Click() {
  m_globals.features().showLineNumbering();
}

void CVBEvents::EvButtonIndentation_Click() {
  m_globals.features().showIndentation();
}

void CVBEvents::EvButtonCloseWindows_Click() {
  // Code windows and designers; the project, properties and other tool windows stay.
  for (const auto& window : m_vbe.Windows()->items()) {
    const ide::WindowType type = window->Type();
    if (type == ide::WindowType::CodeWindow || type == ide::WindowType::Designer) window->Close();
  }
}

void CVBEvents::EvButtonExtendedFind_Click() {
  m_globals.features().showExtendedFind();
}

void CVBEvents::EvButtonTaskList_Click() {
  m_globals.features().showTaskList();
}

void CVBEvents::EvButtonNewProcedure_Click() {
  m_globals.features().showNewProcedure();
}

void CVBEvents::EvButtonOptions_Click() {
  m_globals.features().showOptions();
}

void CVBEvents::EvMnuQMHelpHandler_Click() {
  ide::UserInterface& ui = m_vbe.Platform().ui();
  if (!showHelpContents(ui, m_globals.values().InstallDir))
    ui.MsgBox(QString::fromUtf16(kHelpNotFound), ide::mb::Information, common::title());
}

void CVBEvents::EvMnuAddToFavoritesDsg_Click() {
  try {
    auto pane = m_vbe.ActiveCodePane();
    if (!pane) return;
    int startLine = 0, startColumn = 0, endLine = 0, endColumn = 0;
    pane->GetSelection(startLine, startColumn, endLine, endColumn);
    auto module = pane->CodeModule();
    FavoritePlace place;
    place.project = m_vbe.ActiveVBProject();
    place.component = module->Parent();
    place.line = startLine;
    place.procName =
        module->CountOfLines() >= startLine ? module->ProcOfLine(startLine, place.procKind) : QString();
    if (place.procName.isEmpty()) {
      place.procName = QStringLiteral("General Declarations");
      place.procKind = ide::ProcKind::Proc;
    } else if (place.procKind != ide::ProcKind::Proc) {
      place.procKind = m_globals.EnvUtils().GetPropertyType(module, place.procName, startLine);
    }
    m_globals.features().addFavorite(place);
  } catch (const std::exception& failure) {
    logIgnored(failure, "EvMnuAddToFavoritesDsg_Click");
  }
}

void CVBEvents::EvMnuAddToFavoritesBrk_Click() {
  EvMnuAddToFavoritesDsg_Click();
}

// ---------------------------------------------------------------------------------------------------
// Projects

void CVBEvents::EvProjectsHandler_ItemAdded(const ide::Ref<ide::VBProject>& project) {
  try {
    m_globals.features().projectAdded(project);
    m_globals.controls().setContextItemsEnabled(true);
    m_globals.CommandState().setRange(common::CommandId::Favorites, common::CommandId::TaskList, true);
    // The component events follow the new project once the IDE has finished adding it.
    ide::WindowSystem& windows = m_vbe.Platform().windows();
    const ide::HWnd main = m_vbe.MainWindow()->hWnd();
    if (!m_idleSubclass) m_idleSubclass = SubclassedWindow::install(windows, main, m_idleProc);
    windows.PostMessage(main, m_globals.IdleMessage(), 0, 0);
  } catch (const std::exception& failure) {
    reportUndetermined(failure, "EvProjectsHandler_ItemAdded", std::source_location::current());
  }
}

qintptr CVBEvents::idleProcedure(ide::HWnd window, unsigned message, quintptr wParam, qintptr lParam) {
  ide::WindowSystem& windows = m_vbe.Platform().windows();
  if (message == m_globals.IdleMessage()) {
    try {
      if (auto project = m_vbe.ActiveVBProject()) connectProjectEvents(project);
    } catch (const std::exception& failure) {
      logIgnored(failure, "idleProcedure");
    }
    const qintptr result = callOldWindowProc(windows, window, message, wParam, lParam);
    m_idleSubclass.reset();
    return result;
  }
  if (message == ide::msg::Destroy) {
    const qintptr result = callOldWindowProc(windows, window, message, wParam, lParam);
    m_idleSubclass.reset();
    return result;
  }
  return callOldWindowProc(windows, window, message, wParam, lParam);
}

void CVBEvents::EvProjectsHandler_ItemRemoved(const ide::Ref<ide::VBProject>& project) {
  try {
    Features& features = m_globals.features();
    features.findWindowProjectRemoved(project);
    // Closing a project removes none of its components: their favourites stay in its info file (and the
    // history goes as a whole below).
    features.projectRemoved(project);
    m_globals.Histories().ClearHistories(navigation::CA_TOTAL);
    // The IDE announces the removal while the project is still listed.
    int left = 0;
    for (const auto& other : m_vbe.VBProjects()->items())
      if (other != project) ++left;
    if (left == 0) m_globals.controls().setContextItemsEnabled(false);
  } catch (const std::exception& failure) {
    reportUndetermined(failure, "EvProjectsHandler_ItemRemoved", std::source_location::current());
  }
}

void CVBEvents::EvProjectsHandler_ItemRenamed(const ide::Ref<ide::VBProject>& project,
                                              const QString& oldName) {
  try {
    m_globals.features().projectRenamed(project, oldName);
  } catch (const std::exception& failure) {
    logIgnored(failure, "EvProjectsHandler_ItemRenamed");
  }
}

void CVBEvents::EvProjectsHandler_ItemActivated(const ide::Ref<ide::VBProject>& project) {
  try {
    common::CommandState& state = m_globals.CommandState();
    using common::CommandId;
    for (const CommandId command : {CommandId::Favorites, CommandId::Macros, CommandId::CopyBuffers,
                                    CommandId::CloseWindows, CommandId::ExtendedFind, CommandId::TaskList})
      state.set(command, true);
    connectProjectEvents(project);
  } catch (const std::exception& failure) {
    logIgnored(failure, "EvProjectsHandler_ItemActivated");
  }
}

// ---------------------------------------------------------------------------------------------------
// Components and controls (nothing happens to them while the program runs, except renames)

void CVBEvents::EvComponentsHandler_ItemAdded(const ide::Ref<ide::VBComponent>& component) {
  try {
    if (running()) return;
    m_globals.features().componentAdded(component);
  } catch (const std::exception& failure) {
    reportFailure(failure, "EvComponentsHandler_ItemAdded", std::source_location::current());
  }
}

void CVBEvents::EvComponentsHandler_ItemRemoved(const ide::Ref<ide::VBComponent>& component) {
  try {
    componentRemoved(component);
  } catch (const std::exception& failure) {
    reportUndetermined(failure, "EvComponentsHandler_ItemRemoved", std::source_location::current());
  }
}

void CVBEvents::componentRemoved(const ide::Ref<ide::VBComponent>& component) {
  if (running()) return;
  Features& features = m_globals.features();
  features.findWindowComponentRemoved(component);
  features.componentRemoved(component);
  m_globals.Histories().RemoveHistoriesOfComponent(component);
}

void CVBEvents::EvComponentsHandler_ItemRenamed(const ide::Ref<ide::VBComponent>& component,
                                                const QString& oldName) {
  try {
    m_globals.features().componentRenamed(component, oldName);
  } catch (const std::exception& failure) {
    logIgnored(failure, "EvComponentsHandler_ItemRenamed");
  }
}

void CVBEvents::EvComponentsHandler_ItemActivated(const ide::Ref<ide::VBComponent>& component) {
  try {
    componentActivatedOrSelected(component);
  } catch (const std::exception& failure) {
    logIgnored(failure, "EvComponentsHandler_ItemActivated");
  }
}

void CVBEvents::EvComponentsHandler_ItemSelected(const ide::Ref<ide::VBComponent>& component) {
  try {
    componentActivatedOrSelected(component);
  } catch (const std::exception& failure) {
    reportFailure(failure, "EvComponentsHandler_ItemSelected", std::source_location::current());
  }
}

void CVBEvents::componentActivatedOrSelected(const ide::Ref<ide::VBComponent>& component) {
  if (running()) return;
  if (component->Type() == ide::ComponentType::RelatedDocument) return;
  connectControlEvents(component);
  m_globals.hotKeyWindow().moveToFocusedCodeWindow();
}

void CVBEvents::EvControlsHandler_ItemAdded(const ide::Ref<ide::VBControl>& control) {
  try {
    if (running()) return;
    m_globals.features().controlAdded(control);
  } catch (const std::exception& failure) {
    reportFailure(failure, "EvControlsHandler_ItemAdded", std::source_location::current());
  }
}

void CVBEvents::EvControlsHandler_ItemRenamed(const ide::Ref<ide::VBControl>& control, const QString& oldName,
                                              int oldIndex) {
  try {
    m_globals.features().controlRenamed(control, oldName, oldIndex);
  } catch (const std::exception& failure) {
    reportFailure(failure, "EvControlsHandler_ItemRenamed", std::source_location::current());
  }
}

void CVBEvents::EvFileControlHandler_AfterChangeFileName(const ide::Ref<ide::VBProject>& project,
                                                         ide::FileType type, const QString& newName,
                                                         const QString& oldName) {
  try {
    if (type != ide::FileType::Project) return;
    if (QFileInfo(newName).absolutePath() == QFileInfo(oldName).absolutePath()) return;
    m_globals.features().projectFileMoved(project, newName, oldName);
  } catch (const std::exception& failure) {
    reportUndetermined(failure, "EvFileControlHandler_AfterChangeFileName", std::source_location::current());
  }
}

}  // namespace addin
