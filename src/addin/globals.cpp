// SPDX-License-Identifier: MIT
#include "addin/globals.h"

#include "addin/pictures.h"
#include "addin/texts.h"
#include "common/errors.h"
#include "common/strings.h"

namespace addin {
namespace {

using common::CommandId;

constexpr long kNoConfigurationAccessError = 999;
/// Names longer than this are cut, as the system's name buffers are.
constexpr int kMaxNameLength = 255;

QString systemName(QString name) {
  if (const qsizetype nul = name.indexOf(QChar(u'\0')); nul >= 0) name.truncate(nul);
  name.truncate(kMaxNameLength);
  return name;
}

}  // namespace

AddInControls::~AddInControls() {
  // The items go first, in table order; the members then go in reverse: popup, context items, toolbar.
  for (OwnedControl& item : menuItems)
    item.release();
}

void AddInControls::setContextItemsEnabled(bool enabled) {
  for (const OwnedControl& item : contextItems)
    if (item) item->setEnabled(enabled);
}

ScopedTimer::ScopedTimer(ide::EventLoop& loop, int intervalMs, std::function<void()> callback)
    : m_loop(loop), m_id(loop.SetTimer(intervalMs, std::move(callback))) {
  if (m_id == 0) ide::raise(ide::err::InvalidProcedureCall, QStringLiteral("SetTimer"));
}

ScopedTimer::~ScopedTimer() {
  try {
    m_loop.KillTimer(m_id);
  } catch (const std::exception& failure) {
    common::logFailure(failure, QStringLiteral("ScopedTimer"), QStringLiteral("KillTimer"), __LINE__);
  }
}

// ---------------------------------------------------------------------------------------------------

Globals::Globals(ide::Ref<ide::VBE> vbe, ide::Ref<ide::AddIn> addIn, StartupValues values,
                 Environment& environment)
    : m_vbe(std::move(vbe)),
      m_addIn(std::move(addIn)),
      m_values(std::move(values)),
      m_settings(common::SettingsStore::userStorePath()) {
  ide::Platform& platform = m_vbe->Platform();

  // The settings.
  m_options = common::GetOptionsFromRegistry(m_settings);

  // The message that defers work until the IDE is idle (the hotkey window procedure is made with its keeper
  // below).
  m_idleMessage = platform.windows().RegisterWindowMessage(QString::fromLatin1(kIdleMessageName));
  if (m_idleMessage == 0) ide::raise(ide::err::InvalidProcedureCall, QStringLiteral("RegisterWindowMessage"));

  // The machine-wide configuration must be readable, at the second try at the latest (reading is all the
  // add-in does with it).
  MachineConfig& config = *environment.machineConfig;
  if (!config.canRead() && !config.canRead())
    ide::raise(kNoConfigurationAccessError, QString::fromUtf16(kNoConfigurationAccess), config.location());

  // The computer and user names for the placeholders.
  m_computerName = systemName(platform.computerName());
  m_userName = systemName(platform.userName());

  // The application database, at the path the machine configuration names now. Without it the add-in
  // works on: the message names the file and says what is missing, and the file is left as it is.
  m_appInfo.emplace();
  try {
    m_appInfo->OpenFile(config.installationPath());
  } catch (const std::exception&) {
    common::recordError(ide::Error(appdata::kAppDataError, m_appInfo->UnavailableMessage()),
                        QStringLiteral("Globals"), QStringLiteral("OpenAppInfo"), __LINE__);
    common::logLastError();
    platform.ui().MsgBox(m_appInfo->UnavailableMessage(), ide::mb::Exclamation, common::title());
  }
  m_textInsertion.emplace(
      *m_vbe, textins::InsertionContext{m_computerName, m_userName, [this] { return m_lastWindowType; }});

  // The browse history.
  m_histories.emplace(*m_vbe, m_commandState);
  m_sampler.emplace(*m_histories);

  // The event object, the utilities and the feature areas.
  m_envUtils.emplace(*m_vbe);
  m_features =
      environment.createFeatures({m_vbe, m_settings, m_options, AppInfo(), m_appInfo->UnavailableMessage(),
                                  *m_textInsertion, m_values.InstallDir, m_values.StartDisplayModel});
  m_vbEvents.emplace(*this);

  // The toolbar, the menus and the context-menu items, their click sinks, the IDE's event sinks and
  // the timer.
  m_hotKeyWindow.emplace(*m_vbe, m_values.StartDisplayModel, m_features->copyBuffers(), m_features->macros(),
                         [this] { m_lastWindowType = -1; });
  buildCommandBars();
  m_vbEvents->ConnectMenus(true);
  m_vbEvents->UpdateEventHandlers(true);
  m_timer.emplace(platform.loop(), kTimerIntervalMs, [this] { onTimer(); });
}

Globals::~Globals() = default;

void Globals::buildCommandBars() {
  m_controls.emplace();
  AddInControls& controls = *m_controls;
  auto bars = m_vbe->CommandBars();

  controls.toolbar = m_envUtils->AddToolBar();
  m_vbEvents->ConnectToolBarEvents(controls.toolbar.get());

  // The popup goes before the menu bar's eleventh menu (the "Add-Ins" menu), where add-ins keep theirs.
  controls.popup = OwnedControl(
      bars->Item(QStringLiteral("Menu Bar"))->Controls()->Add(ide::ControlType::Popup, 1, {}, 11, true));
  controls.popup->setCaption(common::title());

  m_commandState.setRange(CommandId::Favorites, CommandId::Help, true);
  m_commandState.set(CommandId::NewProcedure, false);  // only while a code window is active

  auto popupBar = controls.popup->CommandBar();
  for (const CommandEntry& command : commandTable()) {
    if (!(command.placement & OnPopup)) continue;
    OwnedControl item = m_envUtils->AddMenuItem(popupBar, common::LoadResString(command.captionResource()), 0,
                                                false, command.picture);
    item->setEnabled(true);
    controls.menuItems.push_back(std::move(item));
  }

  const char* const contextBars[] = {"Code Window", "Code Window (Break)"};
  for (const CommandEntry& command : commandTable()) {
    if (!(command.placement & OnCodeWindowMenus)) continue;
    for (size_t i = 0; i < controls.contextItems.size(); ++i) {
      auto bar = bars->Item(QString::fromLatin1(contextBars[i]));
      OwnedControl item(bar->Controls()->Add(ide::ControlType::Button, 1, {}, 1, true));
      item->setCaption(common::LoadResString(command.captionResource()));
      item->setStyle(ide::ButtonStyle::IconAndCaption);
      item->setFace(pictureData(command.picture));
      controls.contextItems[i] = std::move(item);
    }
  }
}

// ---------------------------------------------------------------------------------------------------
// The timer

void Globals::onTimer() {
  try {
    if (!m_timer) return;
    if (m_vbe->MainWindow()->WindowState() == ide::WindowState::Minimize) return;
    // Only a running program stops the sampling; break mode still records.
    if (m_envUtils->IdeMode() == ide::IdeMode::Run) return;
    const ide::Ref<ide::Window> active = m_vbe->ActiveWindow();
    m_sampler->tick(*m_vbe, active, m_hotKeyWindow->IsSubclassed());
    m_hotKeyWindow->followFocus();
    updateCommandState(trackActiveWindow(active));
  } catch (const std::exception& failure) {
    common::recordErrorNumber(failure);
    common::logFailure(failure, QStringLiteral("Globals"), QStringLiteral("onTimer"), __LINE__);
  }
}

bool Globals::trackActiveWindow(const ide::Ref<ide::Window>& active) {
  if (!active) {
    m_lastWindowType = -1;
    return false;
  }
  const ide::Ref<ide::Window> main = m_vbe->MainWindow();
  if (active == main || active->hWnd() == main->hWnd()) {
    if (!m_hotKeyWindow->IsSubclassed()) m_lastWindowType = -1;
    if (m_values.StartDisplayModel == ide::DisplayModel::MDI)
      return active->Type() == ide::WindowType::CodeWindow &&
             active->WindowState() != ide::WindowState::Minimize;
    // In SDI display the IDE may name its main window while a top-level code window has the focus.
    return m_lastWindowType == static_cast<int>(ide::WindowType::CodeWindow);
  }
  const ide::WindowType type = active->Type();
  m_lastWindowType = static_cast<int>(type);
  if (type == ide::WindowType::Designer) {
    if (auto component = m_vbe->SelectedVBComponent()) m_vbEvents->connectControlEvents(component);
  }
  return type == ide::WindowType::CodeWindow && active->WindowState() != ide::WindowState::Minimize;
}

void Globals::updateCommandState(bool codeWindowActive) {
  m_commandState.set(CommandId::NewProcedure, codeWindowActive);
  m_controls->setContextItemsEnabled(codeWindowActive);
  if (m_vbe->VBProjects()->Count() != 0) return;
  m_features->allProjectsClosed();
  m_histories->ClearHistories(navigation::CA_TOTAL);
  m_lastWindowType = -1;
  m_controls->setContextItemsEnabled(false);
  m_commandState.setRange(CommandId::Favorites, CommandId::NewProcedure, false);
}

}  // namespace addin
