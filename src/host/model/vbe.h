// SPDX-License-Identifier: MIT
// The IDE model's root: the VBE object with its projects, windows, command bars, events and add-ins, and
// the operations a front end needs beyond the object model (opening files, saving, the IDE mode, window
// activation). The command-line tool, the tests and the desktop host all drive the IDE through this class.
#pragma once

#include "host/model/objects.h"
#include "host/platform/platform.h"

#include <QString>

#include <memory>
#include <vector>

namespace host {

class CommandBarsImpl;
class EventsImpl;
class AddInsImpl;
class ManualEventLoop;
class HeadlessUi;
class GroupFile;

/// The mode as the IDE's caption shows it: "design", "run" or "break".
QLatin1StringView modeName(ide::IdeMode mode);

struct IdeOptions {
  ide::DisplayModel displayModel = ide::DisplayModel::MDI;
  /// The loop and user interface of a desktop host; empty: a ManualEventLoop and a HeadlessUi.
  std::unique_ptr<ide::EventLoop> loop;
  std::unique_ptr<ide::UserInterface> ui;
};

class VbeImpl final : public ide::VBE, public std::enable_shared_from_this<VbeImpl> {
 public:
  static std::shared_ptr<VbeImpl> create(IdeOptions options = {});
  ~VbeImpl() override;

  // ide::VBE
  QString Version() override { return QStringLiteral("6.00"); }
  ide::Ref<ide::VBProjects> VBProjects() override;
  ide::Ref<ide::CommandBars> CommandBars() override;
  ide::Ref<ide::Windows> Windows() override;
  ide::Ref<ide::CodePanes> CodePanes() override;
  ide::Ref<ide::Events> Events() override;
  ide::Ref<ide::AddIns> Addins() override;
  ide::Ref<ide::VBProject> ActiveVBProject() override { return m_activeProject.lock(); }
  void setActiveVBProject(const ide::Ref<ide::VBProject>& project) override;
  ide::Ref<ide::VBComponent> SelectedVBComponent() override;
  ide::Ref<ide::Window> MainWindow() override { return m_mainWindow; }
  ide::Ref<ide::Window> ActiveWindow() override;
  ide::Ref<ide::CodePane> ActiveCodePane() override;
  void setActiveCodePane(const ide::Ref<ide::CodePane>& pane) override;
  ide::DisplayModel DisplayModel() override { return m_displayModel; }
  ide::Platform& Platform() override { return *m_platform; }

  // --- Files
  /// Opens a group (.vbg), a project (.vbp) or a single module file (then in a new, unsaved project).
  /// Nothing is added when anything fails; throws ide::Error naming the file and line. A file of another
  /// kind is refused without being read. Files that a group or project lists but that are missing are
  /// left out (see missingFiles()).
  std::vector<std::shared_ptr<ProjectImpl>> open(const QString& path);
  std::shared_ptr<ProjectImpl> openProject(const QString& path);
  std::vector<std::shared_ptr<ProjectImpl>> openGroup(const QString& path);
  /// A module file opened alone, in a project of its own; with `contents`, the module is those bytes
  /// rather than what the file holds.
  std::shared_ptr<ProjectImpl> openModuleFile(const QString& path, const QByteArray* contents = nullptr);
  std::shared_ptr<ProjectImpl> newProject(ide::ProjectType type = ide::ProjectType::StandardExe);
  /// Closes a project (its windows too); fires the project's removal.
  void removeProject(const std::shared_ptr<ProjectImpl>& project);
  /// Saves every project (and the group file when one is open and changed).
  void saveAll();
  /// The files of `paths` become the ones a save overwrites, whatever another program did to them since
  /// they were read (the user chose to overwrite them).
  void acceptFilesOnDisk(const QStringList& paths);
  QString groupFileName() const { return m_groupPath; }
  /// The project files the open group listed and the files the open projects listed that were missing
  /// when they were opened: their entries stay as they are.
  std::vector<MissingFile> missingFiles() const;
  const std::vector<std::shared_ptr<ProjectImpl>>& projects() const { return m_projects; }
  std::shared_ptr<ProjectImpl> project(const QString& name) const;

  // --- State
  ide::IdeMode mode() const { return m_mode; }
  /// Switches design, run and break mode; the "Standard" bar's Start, Continue, Break and End follow.
  void setMode(ide::IdeMode mode);
  /// Whether modules opened from now on keep their code as the file's bytes until it is first used (for
  /// tools that work on one module after the other; the IDE reads every module as it opens).
  void setReadsCodeOnDemand(bool onDemand) { m_readsCodeOnDemand = onDemand; }
  bool readsCodeOnDemand() const { return m_readsCodeOnDemand; }
  /// Runs the IDE's own commands that the model does not run itself (the desktop host's file commands).
  void setCommandHandler(std::function<void(int)> handler) { m_commandHandler = std::move(handler); }
  /// Selects a component in the project window (fires its selection); empty clears the selection.
  void selectComponent(const std::shared_ptr<ComponentImpl>& component);
  /// Makes a window the active one and gives it the keyboard focus; a component's window also makes the
  /// component selected and active.
  void activateWindow(const std::shared_ptr<WindowImpl>& window);
  /// A window opened or closed (called by the window).
  void windowOpened(const std::shared_ptr<WindowImpl>& window);
  void windowClosed(WindowImpl& window);
  std::vector<std::shared_ptr<WindowImpl>> openWindows() const;
  /// A code or designer window opened; a window was activated (also when it was active already). The
  /// desktop host shows the one and brings the other to the front.
  ide::Signal<WindowImpl*> childWindowOpened;
  ide::Signal<WindowImpl*> windowActivated;
  std::shared_ptr<WindowImpl> mainWindow() const { return m_mainWindow; }
  std::shared_ptr<WindowImpl> projectWindow() const { return m_projectWindow; }
  std::shared_ptr<WindowImpl> propertiesWindow() const { return m_propertiesWindow; }
  /// The parent of code and designer windows: the MDI client in MDI display, none (top level) in SDI.
  ide::HWnd childWindowParent() const;

  // --- Services
  PlatformImpl& platform() { return *m_platform; }
  WindowSystemImpl& windowSystem() { return m_platform->windowSystem(); }
  /// The headless loop and user interface, or null in a desktop host.
  ManualEventLoop* manualLoop() const { return m_manualLoop; }
  HeadlessUi* headlessUi() const { return m_headlessUi; }
  std::shared_ptr<CommandBarsImpl> commandBars() const { return m_commandBars; }
  EventsImpl& events() { return *m_events; }
  AddInsImpl& addIns() { return *m_addIns; }

  /// Connects the add-ins that load with the IDE (connect mode Startup), then tells them the start-up is
  /// complete. Call once, after the first projects are open.
  void startup();
  /// Disconnects every add-in (HostShutdown) and closes the windows; the IDE is done afterwards.
  void shutdown();

  // --- Events, fired to the IDE-wide sources and to those of the object's project
  void fireProjectAdded(const std::shared_ptr<ProjectImpl>& project);
  void fireProjectRemoved(const std::shared_ptr<ProjectImpl>& project);
  void fireProjectRenamed(const std::shared_ptr<ProjectImpl>& project, const QString& oldName);
  void fireComponentAdded(const std::shared_ptr<ComponentImpl>& component);
  void fireComponentRemoved(const std::shared_ptr<ComponentImpl>& component);
  void fireComponentRenamed(const std::shared_ptr<ComponentImpl>& component, const QString& oldName);
  void fireFileNameChanged(const std::shared_ptr<ProjectImpl>& project, ide::FileType type,
                           const QString& newName, const QString& oldName);
  void fireControlAdded(const std::shared_ptr<ControlImpl>& control);
  void fireControlRemoved(const std::shared_ptr<ControlImpl>& control);
  void fireControlRenamed(const std::shared_ptr<ControlImpl>& control, const QString& oldName, int oldIndex);
  void fireSelectedControl(const std::shared_ptr<ControlImpl>& control, bool added);
  void fireFileAdded(const std::shared_ptr<ProjectImpl>& project, ide::FileType type,
                     const QString& fileName);
  void fireFileRemoved(const std::shared_ptr<ProjectImpl>& project, ide::FileType type,
                       const QString& fileName);
  void fireFileClosed(const std::shared_ptr<ProjectImpl>& project, ide::FileType type,
                      const QString& fileName, bool wasDirty);
  /// result: 0 written, 2 failed.
  void fireFileWritten(const std::shared_ptr<ProjectImpl>& project, ide::FileType type,
                       const QString& fileName, int result);

 private:
  explicit VbeImpl(IdeOptions& options);
  void init();
  void addProject(const std::shared_ptr<ProjectImpl>& project);
  void runCommand(int command);

  std::unique_ptr<PlatformImpl> m_platform;
  ManualEventLoop* m_manualLoop = nullptr;
  HeadlessUi* m_headlessUi = nullptr;
  ide::DisplayModel m_displayModel;
  ide::IdeMode m_mode = ide::IdeMode::Design;
  std::shared_ptr<CommandBarsImpl> m_commandBars;
  std::shared_ptr<EventsImpl> m_events;
  std::shared_ptr<AddInsImpl> m_addIns;
  std::vector<std::shared_ptr<ProjectImpl>> m_projects;
  std::weak_ptr<ProjectImpl> m_activeProject;
  std::weak_ptr<ComponentImpl> m_selectedComponent;
  std::shared_ptr<WindowImpl> m_mainWindow;
  ide::HWnd m_mdiClient = 0;
  std::shared_ptr<WindowImpl> m_projectWindow;
  std::shared_ptr<WindowImpl> m_propertiesWindow;
  std::shared_ptr<WindowImpl> m_toolboxWindow;
  std::shared_ptr<WindowImpl> m_immediateWindow;
  /// Open code and designer windows, most recently activated last.
  std::vector<std::shared_ptr<WindowImpl>> m_childWindows;
  std::weak_ptr<WindowImpl> m_activeWindow;
  std::weak_ptr<CodePaneImpl> m_activePane;
  QString m_groupPath;
  std::unique_ptr<GroupFile> m_group;
  bool m_groupChanged = false;
  bool m_readsCodeOnDemand = false;
  std::vector<MissingFile> m_missingProjects;
  std::optional<fileio::FileStamp> m_groupStamp;
  std::function<void(int)> m_commandHandler;
};

}  // namespace host
