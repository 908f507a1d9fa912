// SPDX-License-Identifier: MIT
#include "host/model/vbe.h"

#include "fileio/fileio.h"
#include "host/files/groupfile.h"
#include "host/files/projectfile.h"
#include "host/files/sourcelines.h"
#include "host/model/addins.h"
#include "host/model/commandbars.h"
#include "host/model/designer.h"
#include "host/model/events.h"
#include "host/platform/headlessui.h"
#include "host/platform/manualloop.h"

#include <QDir>
#include <QFileInfo>

namespace host {

using namespace fileio;
namespace {

template <class T>
class ListCollection : public ide::Collection<T> {
 public:
  explicit ListCollection(std::vector<ide::Ref<T>> items) : m_items(std::move(items)) {}
  int Count() override { return static_cast<int>(m_items.size()); }
  ide::Ref<T> Item(int index) override {
    if (index < 1 || index > Count()) ide::raise(ide::err::SubscriptOutOfRange);
    return m_items[static_cast<size_t>(index - 1)];
  }

 protected:
  std::vector<ide::Ref<T>> m_items;
};

class WindowsImpl final : public ide::Windows {
 public:
  explicit WindowsImpl(std::vector<ide::Ref<ide::Window>> items) : m_list(std::move(items)) {}
  int Count() override { return m_list.Count(); }
  ide::Ref<ide::Window> Item(int index) override { return m_list.Item(index); }

 private:
  ListCollection<ide::Window> m_list;
};

class CodePanesImpl final : public ide::CodePanes {
 public:
  explicit CodePanesImpl(std::vector<ide::Ref<ide::CodePane>> items) : m_list(std::move(items)) {}
  int Count() override { return m_list.Count(); }
  ide::Ref<ide::CodePane> Item(int index) override { return m_list.Item(index); }

 private:
  ListCollection<ide::CodePane> m_list;
};

class ProjectsImpl final : public ide::VBProjects {
 public:
  explicit ProjectsImpl(std::shared_ptr<VbeImpl> vbe) : m_vbe(std::move(vbe)) {}
  int Count() override { return static_cast<int>(m_vbe->projects().size()); }
  ide::Ref<ide::VBProject> Item(int index) override {
    if (index < 1 || index > Count()) ide::raise(ide::err::SubscriptOutOfRange);
    return m_vbe->projects()[static_cast<size_t>(index - 1)];
  }
  ide::Ref<ide::VBProject> Item(const QString& name) override {
    if (auto project = m_vbe->project(name)) return project;
    ide::raise(ide::err::SubscriptOutOfRange);
  }
  ide::Ref<ide::VBProject> AddFromFile(const QString& fileName) override {
    return m_vbe->openProject(fileName);
  }
  ide::Ref<ide::VBProject> Add(ide::ProjectType type) override { return m_vbe->newProject(type); }
  void Remove(const ide::Ref<ide::VBProject>& project) override {
    auto impl = std::dynamic_pointer_cast<ProjectImpl>(project);
    if (!impl) ide::raise(ide::err::InvalidProcedureCall);
    m_vbe->removeProject(impl);
  }

 private:
  std::shared_ptr<VbeImpl> m_vbe;
};

bool isChildWindow(WindowImpl& window) {
  return window.Type() == ide::WindowType::CodeWindow || window.Type() == ide::WindowType::Designer;
}

}  // namespace

// ---------------------------------------------------------------------------------------------------
// Event sources

EventsImpl::EventsImpl()
    : projects(std::make_shared<ide::ProjectsEventSource>()),
      components(std::make_shared<ide::ComponentsEventSource>()),
      references(std::make_shared<ide::ReferencesEventSource>()),
      files(std::make_shared<ide::FileControlEventSource>()),
      controls(std::make_shared<ide::ControlsEventSource>()),
      selectedControls(std::make_shared<ide::SelectedControlsEventSource>()) {}

ide::Ref<ide::ComponentsEventSource> EventsImpl::VBComponentsEvents(const ide::Ref<ide::VBProject>& project) {
  if (auto impl = std::dynamic_pointer_cast<ProjectImpl>(project)) return impl->componentEvents;
  return components;
}

ide::Ref<ide::ReferencesEventSource> EventsImpl::ReferencesEvents(const ide::Ref<ide::VBProject>& project) {
  if (auto impl = std::dynamic_pointer_cast<ProjectImpl>(project)) return impl->referenceEvents;
  return references;
}

ide::Ref<ide::FileControlEventSource> EventsImpl::FileControlEvents(const ide::Ref<ide::VBProject>& project) {
  if (auto impl = std::dynamic_pointer_cast<ProjectImpl>(project)) return impl->fileEvents;
  return files;
}

ide::Ref<ide::ControlsEventSource> EventsImpl::VBControlsEvents(const ide::Ref<ide::VBProject>& project,
                                                                const ide::Ref<ide::VBForm>& form) {
  if (auto formImpl = std::dynamic_pointer_cast<FormImpl>(form)) return formControlEvents(formImpl.get());
  if (auto impl = std::dynamic_pointer_cast<ProjectImpl>(project)) return impl->controlEvents;
  return controls;
}

ide::Ref<ide::SelectedControlsEventSource> EventsImpl::SelectedVBControlsEvents(
    const ide::Ref<ide::VBProject>& project, const ide::Ref<ide::VBForm>& form) {
  if (auto formImpl = std::dynamic_pointer_cast<FormImpl>(form))
    return formSelectedControlEvents(formImpl.get());
  if (auto impl = std::dynamic_pointer_cast<ProjectImpl>(project)) return impl->selectedControlEvents;
  return selectedControls;
}

ide::Ref<ide::CommandBarEventSource> EventsImpl::CommandBarEvents(
    const ide::Ref<ide::CommandBarControl>& control) {
  auto impl = std::dynamic_pointer_cast<CommandBarControlImpl>(control);
  if (!impl) ide::raise(ide::err::InvalidProcedureCall);
  return impl->clickSource();
}

std::shared_ptr<ide::ControlsEventSource> EventsImpl::formControlEvents(const FormImpl* form) {
  auto& slot = m_formControls[form];
  if (!slot) slot = std::make_shared<ide::ControlsEventSource>();
  return slot;
}

std::shared_ptr<ide::SelectedControlsEventSource> EventsImpl::formSelectedControlEvents(
    const FormImpl* form) {
  auto& slot = m_formSelected[form];
  if (!slot) slot = std::make_shared<ide::SelectedControlsEventSource>();
  return slot;
}

void EventsImpl::forgetForm(const FormImpl* form) {
  m_formControls.erase(form);
  m_formSelected.erase(form);
}

QLatin1StringView modeName(ide::IdeMode mode) {
  switch (mode) {
    case ide::IdeMode::Run:
      return QLatin1StringView("run");
    case ide::IdeMode::Break:
      return QLatin1StringView("break");
    case ide::IdeMode::Design:
      break;
  }
  return QLatin1StringView("design");
}

// ---------------------------------------------------------------------------------------------------
// Construction

std::shared_ptr<VbeImpl> VbeImpl::create(IdeOptions options) {
  std::shared_ptr<VbeImpl> vbe(new VbeImpl(options));
  vbe->init();
  return vbe;
}

VbeImpl::VbeImpl(IdeOptions& options) : m_displayModel(options.displayModel) {
  if (!options.loop) {
    auto loop = std::make_unique<ManualEventLoop>();
    m_manualLoop = loop.get();
    options.loop = std::move(loop);
  }
  if (!options.ui) {
    auto ui = std::make_unique<HeadlessUi>();
    m_headlessUi = ui.get();
    options.ui = std::move(ui);
  }
  m_platform = std::make_unique<PlatformImpl>(std::move(options.loop), std::move(options.ui));
}

VbeImpl::~VbeImpl() = default;

void VbeImpl::init() {
  auto self = shared_from_this();
  m_commandBars = std::make_shared<CommandBarsImpl>();
  m_commandBars->buildStandardBars();
  std::weak_ptr<VbeImpl> weak = self;
  m_commandBars->setCommandHandler([weak](BuiltinCommand command) {
    if (auto vbe = weak.lock()) vbe->runCommand(static_cast<int>(command));
  });
  m_events = std::make_shared<EventsImpl>();
  m_addIns = std::make_shared<AddInsImpl>(self);

  m_mainWindow = std::make_shared<WindowImpl>(
      self, ide::WindowType::MainWindow,
      [weak] {
        auto vbe = weak.lock();
        if (!vbe) return QString();
        auto project = vbe->m_activeProject.lock();
        const QString title = QStringLiteral("Quimbel IDE [%1]").arg(modeName(vbe->m_mode));
        return project ? project->Name() + QStringLiteral(" - ") + title : title;
      },
      QStringLiteral("QuimbelIdeMainWindow"));
  m_mainWindow->open();
  m_mdiClient = windowSystem().createWindow(QStringLiteral("MDIClient"), {}, m_mainWindow->hWnd(), {});

  auto toolWindow = [&](ide::WindowType type, const QString& caption, const QString& className) {
    auto window = std::make_shared<WindowImpl>(
        self, type, [caption] { return caption; }, className);
    window->open();
    return window;
  };
  m_projectWindow = std::make_shared<WindowImpl>(
      self, ide::WindowType::ProjectWindow,
      [weak] {
        auto vbe = weak.lock();
        auto project = vbe ? vbe->m_activeProject.lock() : nullptr;
        return project ? QStringLiteral("Project - ") + project->Name() : QStringLiteral("Project");
      },
      QStringLiteral("PROJECT"));
  m_projectWindow->open();
  m_propertiesWindow =
      toolWindow(ide::WindowType::PropertyWindow, QStringLiteral("Properties"), QStringLiteral("PROPERTIES"));
  m_toolboxWindow =
      toolWindow(ide::WindowType::Toolbox, QStringLiteral("General"), QStringLiteral("TOOLBOX"));
  m_immediateWindow =
      toolWindow(ide::WindowType::Immediate, QStringLiteral("Immediate"), QStringLiteral("IMMEDIATE"));
  m_immediateWindow->setVisible(false);

  windowSystem().setActivateHandler([weak](ide::HWnd hwnd) {
    auto vbe = weak.lock();
    if (!vbe) return;
    for (const auto& window : vbe->openWindows())
      if (window->hWnd() == hwnd) return vbe->activateWindow(window);
    if (vbe->m_mainWindow->hWnd() == hwnd) vbe->activateWindow(vbe->m_mainWindow);
  });
}

// ---------------------------------------------------------------------------------------------------
// The object model

ide::Ref<ide::VBProjects> VbeImpl::VBProjects() {
  return std::make_shared<ProjectsImpl>(shared_from_this());
}
ide::Ref<ide::CommandBars> VbeImpl::CommandBars() {
  return m_commandBars;
}
ide::Ref<ide::Events> VbeImpl::Events() {
  return m_events;
}
ide::Ref<ide::AddIns> VbeImpl::Addins() {
  return m_addIns;
}

std::vector<std::shared_ptr<WindowImpl>> VbeImpl::openWindows() const {
  std::vector<std::shared_ptr<WindowImpl>> windows;
  for (const auto& tool : {m_projectWindow, m_propertiesWindow, m_toolboxWindow, m_immediateWindow})
    if (tool && tool->isOpen()) windows.push_back(tool);
  for (const auto& child : m_childWindows)
    if (child->isOpen()) windows.push_back(child);
  return windows;
}

ide::Ref<ide::Windows> VbeImpl::Windows() {
  const auto windows = openWindows();
  std::vector<ide::Ref<ide::Window>> items(windows.begin(), windows.end());
  return std::make_shared<WindowsImpl>(std::move(items));
}

ide::Ref<ide::CodePanes> VbeImpl::CodePanes() {
  std::vector<ide::Ref<ide::CodePane>> panes;
  for (const auto& child : m_childWindows)
    if (child->isOpen())
      if (auto pane = child->pane()) panes.push_back(pane);
  return std::make_shared<CodePanesImpl>(std::move(panes));
}

void VbeImpl::setActiveVBProject(const ide::Ref<ide::VBProject>& project) {
  auto impl = std::dynamic_pointer_cast<ProjectImpl>(project);
  if (project && !impl) ide::raise(ide::err::InvalidProcedureCall);
  if (impl == m_activeProject.lock()) return;
  m_activeProject = impl;
  if (impl) m_events->projects->ItemActivated.fire(impl);
}

ide::Ref<ide::VBComponent> VbeImpl::SelectedVBComponent() {
  auto component = m_selectedComponent.lock();
  return component && component->attached() ? component : nullptr;
}

ide::Ref<ide::Window> VbeImpl::ActiveWindow() {
  auto window = m_activeWindow.lock();
  return window && window->isOpen() && window->Visible() ? window : m_mainWindow;
}

ide::Ref<ide::CodePane> VbeImpl::ActiveCodePane() {
  auto pane = m_activePane.lock();
  if (!pane) return nullptr;
  auto window = pane->window();
  return window && window->isOpen() ? pane : nullptr;
}

void VbeImpl::setActiveCodePane(const ide::Ref<ide::CodePane>& pane) {
  if (!pane) ide::raise(ide::err::InvalidProcedureCall);
  pane->Show();
}

ide::HWnd VbeImpl::childWindowParent() const {
  return m_displayModel == ide::DisplayModel::MDI ? m_mdiClient : 0;
}

// ---------------------------------------------------------------------------------------------------
// Windows

void VbeImpl::windowOpened(const std::shared_ptr<WindowImpl>& window) {
  if (!isChildWindow(*window)) return;
  if (std::find(m_childWindows.begin(), m_childWindows.end(), window) == m_childWindows.end())
    m_childWindows.push_back(window);
  childWindowOpened.fire(window.get());
}

void VbeImpl::windowClosed(WindowImpl& window) {
  const bool wasActive = m_activeWindow.lock().get() == &window;
  std::erase_if(m_childWindows, [&](const auto& w) { return w.get() == &window; });
  if (auto pane = m_activePane.lock(); pane && window.pane() == pane) m_activePane.reset();
  if (!wasActive) return;
  m_activeWindow.reset();
  // The next window in line becomes active, as in an MDI frame.
  for (auto it = m_childWindows.rbegin(); it != m_childWindows.rend(); ++it) {
    if ((*it)->isOpen() && (*it)->WindowState() != ide::WindowState::Minimize) {
      activateWindow(*it);
      return;
    }
  }
  windowSystem().setFocus(m_mainWindow->hWnd());
}

void VbeImpl::activateWindow(const std::shared_ptr<WindowImpl>& window) {
  if (!window) return;
  window->open();
  if (isChildWindow(*window)) {
    std::erase(m_childWindows, window);
    m_childWindows.push_back(window);
  }
  const auto previous = m_activeWindow.lock();
  m_activeWindow = window;
  if (window->Type() == ide::WindowType::CodeWindow) m_activePane = window->pane();
  if (auto component = window->component()) {
    if (auto project = component->project()) setActiveVBProject(project);
    selectComponent(component);
    if (!previous || previous->component() != component) {
      m_events->components->ItemActivated.fire(component);
      if (auto project = component->project()) project->componentEvents->ItemActivated.fire(component);
    }
  }
  windowSystem().setFocus(window->hWnd());
  windowActivated.fire(window.get());
}

void VbeImpl::selectComponent(const std::shared_ptr<ComponentImpl>& component) {
  if (m_selectedComponent.lock() == component) return;
  m_selectedComponent = component;
  if (!component) return;
  if (auto project = component->project()) setActiveVBProject(project);
  m_events->components->ItemSelected.fire(component);
  if (auto project = component->project()) project->componentEvents->ItemSelected.fire(component);
}

// ---------------------------------------------------------------------------------------------------
// Mode and commands

void VbeImpl::setMode(ide::IdeMode mode) {
  m_mode = mode;
  const bool design = mode == ide::IdeMode::Design;
  const bool run = mode == ide::IdeMode::Run;
  const bool brk = mode == ide::IdeMode::Break;
  std::function<void(CommandBarImpl&)> update = [&](CommandBarImpl& bar) {
    for (const auto& control : bar.controls()) {
      switch (control->builtin()) {
        case BuiltinCommand::Start:
          control->setEnabled(design);
          if (bar.Position() != ide::BarPosition::Popup) control->setVisible(!brk);
          break;
        case BuiltinCommand::Continue:
          control->setEnabled(brk);
          if (bar.Position() != ide::BarPosition::Popup) control->setVisible(brk);
          break;
        case BuiltinCommand::Break:
          control->setEnabled(run);
          break;
        case BuiltinCommand::End:
          control->setEnabled(run || brk);
          break;
        default:
          break;
      }
      if (auto popup = control->popupBar()) update(*popup);
    }
  };
  for (const auto& bar : m_commandBars->bars())
    update(*bar);
  m_mainWindow->changed.fire(m_mainWindow.get());
}

void VbeImpl::runCommand(int command) {
  switch (static_cast<BuiltinCommand>(command)) {
    case BuiltinCommand::Start:
    case BuiltinCommand::Continue:
      setMode(ide::IdeMode::Run);
      break;
    case BuiltinCommand::Break:
      setMode(ide::IdeMode::Break);
      break;
    case BuiltinCommand::End:
      setMode(ide::IdeMode::Design);
      break;
    default:
      if (m_commandHandler) m_commandHandler(command);
      break;
  }
}

// ---------------------------------------------------------------------------------------------------
// Files

std::vector<MissingFile> VbeImpl::missingFiles() const {
  std::vector<MissingFile> all = m_missingProjects;
  for (const auto& project : m_projects)
    all.insert(all.end(), project->missingFiles().begin(), project->missingFiles().end());
  return all;
}

std::shared_ptr<ProjectImpl> VbeImpl::project(const QString& name) const {
  for (const auto& project : m_projects)
    if (project->Name().compare(name, Qt::CaseInsensitive) == 0) return project;
  return nullptr;
}

void VbeImpl::addProject(const std::shared_ptr<ProjectImpl>& project) {
  m_projects.push_back(project);
  fireProjectAdded(project);
  setActiveVBProject(project);
}

std::vector<std::shared_ptr<ProjectImpl>> VbeImpl::open(const QString& path) {
  const QString suffix = QFileInfo(path).suffix().toLower();
  if (suffix == QLatin1StringView("vbg")) return openGroup(path);
  if (suffix == QLatin1StringView("vbp")) return {openProject(path)};
  static const QStringList kModuleSuffixes = {
      QStringLiteral("bas"), QStringLiteral("cls"), QStringLiteral("frm"), QStringLiteral("ctl"),
      QStringLiteral("pag"), QStringLiteral("dob"), QStringLiteral("dsr")};
  // Anything else would become a related document of a new project: a folder, a FIFO, a device.
  if (!kModuleSuffixes.contains(suffix))
    ide::raise(ide::err::InvalidFileFormat,
               QStringLiteral("%1: not a project group, project or module file (.vbg, .vbp, .%2)")
                   .arg(path, kModuleSuffixes.join(QStringLiteral(", ."))));
  return {openModuleFile(path)};
}

std::shared_ptr<ProjectImpl> VbeImpl::openProject(const QString& path) {
  auto project = std::make_shared<ProjectImpl>(shared_from_this());
  project->load(QFileInfo(path).absoluteFilePath());
  if (this->project(project->Name()))
    ide::raise(ide::err::NameConflict,
               QStringLiteral("%1: a project named %2 is open already").arg(path, project->Name()));
  addProject(project);
  return project;
}

std::vector<std::shared_ptr<ProjectImpl>> VbeImpl::openGroup(const QString& path) {
  const QString absolute = QFileInfo(path).absoluteFilePath();
  FileStamp stamp;
  auto group = std::make_unique<GroupFile>(GroupFile::parse(readFileBytes(absolute, &stamp), path));
  const QString directory = QFileInfo(absolute).absolutePath();
  // The line of each project entry, for messages.
  std::vector<int> entryLines;
  for (size_t i = 0; i < group->write().size(); ++i) {
    const QString& text = group->write()[i].text;
    if (text.startsWith(QLatin1StringView("Project="), Qt::CaseInsensitive) ||
        text.startsWith(QLatin1StringView("StartupProject="), Qt::CaseInsensitive))
      entryLines.push_back(static_cast<int>(i) + 1);
  }
  // Everything is read before anything is added, so that a failure leaves the IDE as it was.
  std::vector<std::shared_ptr<ProjectImpl>> loaded;
  std::vector<MissingFile> missing;
  const auto entries = group->projects();
  for (size_t i = 0; i < entries.size(); ++i) {
    const int line = i < entryLines.size() ? entryLines[i] : 0;
    const QString projectPath = resolveProjectPath(directory, entries[i].path);
    // The other projects open without a missing one; the group keeps its line.
    if (!QFileInfo::exists(projectPath)) {
      missing.push_back({absolute, line, entries[i].path});
      continue;
    }
    auto project = std::make_shared<ProjectImpl>(shared_from_this());
    project->load(projectPath);
    for (const auto& other : loaded)
      if (other->Name().compare(project->Name(), Qt::CaseInsensitive) == 0)
        ide::raise(ide::err::NameConflict,
                   QStringLiteral("%1, line %2: a project named %3 is in the group already")
                       .arg(path)
                       .arg(line)
                       .arg(project->Name()));
    if (this->project(project->Name()))
      ide::raise(ide::err::NameConflict, QStringLiteral("%1, line %2: a project named %3 is open already")
                                             .arg(path)
                                             .arg(line)
                                             .arg(project->Name()));
    loaded.push_back(project);
  }
  for (const auto& project : loaded)
    addProject(project);
  m_groupPath = absolute;
  m_group = std::move(group);
  m_groupStamp = std::move(stamp);
  m_groupChanged = false;
  m_missingProjects = std::move(missing);
  return loaded;
}

std::shared_ptr<ProjectImpl> VbeImpl::openModuleFile(const QString& path, const QByteArray* contents) {
  auto project = std::make_shared<ProjectImpl>(shared_from_this());
  QString name = QStringLiteral("Project1");
  for (int n = 2; this->project(name); ++n)
    name = QStringLiteral("Project%1").arg(n);
  project->create(ide::ProjectType::StandardExe, name);
  project->addExistingFile(QFileInfo(path).absoluteFilePath(), false, contents);
  addProject(project);
  return project;
}

std::shared_ptr<ProjectImpl> VbeImpl::newProject(ide::ProjectType type) {
  auto project = std::make_shared<ProjectImpl>(shared_from_this());
  QString name = QStringLiteral("Project1");
  for (int n = 2; this->project(name); ++n)
    name = QStringLiteral("Project%1").arg(n);
  project->create(type, name);
  addProject(project);
  return project;
}

void VbeImpl::removeProject(const std::shared_ptr<ProjectImpl>& project) {
  if (std::find(m_projects.begin(), m_projects.end(), project) == m_projects.end())
    ide::raise(ide::err::InvalidProcedureCall);
  fireProjectRemoved(project);
  const bool wasDirty = !project->Saved();
  for (const auto& component : project->components())
    component->closeWindows();
  std::erase(m_projects, project);
  if (auto selected = m_selectedComponent.lock(); selected && selected->project() == project)
    m_selectedComponent.reset();
  if (!project->FileName().isEmpty())
    fireFileClosed(project, ide::FileType::Project, project->FileName(), wasDirty);
  project->detach();
  if (m_activeProject.lock() == project || m_activeProject.expired()) {
    m_activeProject.reset();
    if (!m_projects.empty()) setActiveVBProject(m_projects.front());
  }
  if (m_group) {
    const QString directory = QFileInfo(m_groupPath).absolutePath();
    const auto entries = m_group->projects();
    for (size_t i = 0; i < entries.size(); ++i) {
      if (QFileInfo(resolveProjectPath(directory, entries[i].path)) != QFileInfo(project->FileName()))
        continue;
      m_group->removeProject(static_cast<int>(i));
      m_groupChanged = true;
      break;
    }
  }
}

void VbeImpl::saveAll() {
  // One batch: every file is replaced only once all of them are written and on disk.
  SaveBatch batch;
  for (const auto& project : m_projects)
    project->addToBatch(batch);
  if (m_group && m_groupChanged) {
    batch.add({m_groupPath, m_group->toBytes(m_groupPath), stampFor(m_groupStamp, m_groupPath)},
              [this](const FileStamp* written) {
                if (!written) return;
                m_groupChanged = false;
                m_groupStamp = *written;
              });
  }
  batch.commit();
}

void VbeImpl::acceptFilesOnDisk(const QStringList& paths) {
  restampIfListed(m_groupStamp, paths);
  for (const auto& project : m_projects)
    project->acceptFilesOnDisk(paths);
}

// ---------------------------------------------------------------------------------------------------
// Add-ins

void VbeImpl::startup() {
  for (const auto& addIn : std::vector(m_addIns->addIns())) {
    if (!addIn->loadOnStartup()) continue;
    try {
      addIn->connect(ide::ConnectMode::Startup);
    } catch (const ide::Error& error) {
      m_platform->ui().MsgBox(error.description(), ide::mb::Exclamation, QStringLiteral("Quimbel IDE"));
    }
  }
  for (const auto& addIn : std::vector(m_addIns->addIns()))
    addIn->startupComplete();
}

void VbeImpl::shutdown() {
  for (const auto& addIn : std::vector(m_addIns->addIns()))
    addIn->disconnect(ide::DisconnectMode::HostShutdown);
  for (const auto& window : std::vector(m_childWindows))
    window->Close();
}

// ---------------------------------------------------------------------------------------------------
// Events

void VbeImpl::fireProjectAdded(const std::shared_ptr<ProjectImpl>& project) {
  m_events->projects->ItemAdded.fire(project);
}

void VbeImpl::fireProjectRemoved(const std::shared_ptr<ProjectImpl>& project) {
  m_events->projects->ItemRemoved.fire(project);
}

void VbeImpl::fireProjectRenamed(const std::shared_ptr<ProjectImpl>& project, const QString& oldName) {
  m_events->projects->ItemRenamed.fire(project, oldName);
}

void VbeImpl::fireComponentAdded(const std::shared_ptr<ComponentImpl>& component) {
  m_events->components->ItemAdded.fire(component);
  if (auto project = component->project()) project->componentEvents->ItemAdded.fire(component);
}

void VbeImpl::fireComponentRemoved(const std::shared_ptr<ComponentImpl>& component) {
  m_events->components->ItemRemoved.fire(component);
  if (auto project = component->project()) project->componentEvents->ItemRemoved.fire(component);
}

void VbeImpl::fireComponentRenamed(const std::shared_ptr<ComponentImpl>& component, const QString& oldName) {
  m_events->components->ItemRenamed.fire(component, oldName);
  if (auto project = component->project()) project->componentEvents->ItemRenamed.fire(component, oldName);
}

void VbeImpl::fireFileNameChanged(const std::shared_ptr<ProjectImpl>& project, ide::FileType type,
                                  const QString& newName, const QString& oldName) {
  m_events->files->AfterChangeFileName.fire(project, type, newName, oldName);
  project->fileEvents->AfterChangeFileName.fire(project, type, newName, oldName);
}

void VbeImpl::fireSelectedControl(const std::shared_ptr<ControlImpl>& control, bool added) {
  auto form = control->form();
  auto project = form && form->component() ? form->component()->project() : nullptr;
  auto fire = [&](ide::SelectedControlsEventSource& source) {
    if (added)
      source.ItemAdded.fire(control);
    else
      source.ItemRemoved.fire(control);
  };
  fire(*m_events->selectedControls);
  if (project) fire(*project->selectedControlEvents);
  if (form) fire(*m_events->formSelectedControlEvents(form.get()));
}

void VbeImpl::fireFileAdded(const std::shared_ptr<ProjectImpl>& project, ide::FileType type,
                            const QString& fileName) {
  m_events->files->AfterAddFile.fire(project, type, fileName);
  project->fileEvents->AfterAddFile.fire(project, type, fileName);
}

void VbeImpl::fireFileRemoved(const std::shared_ptr<ProjectImpl>& project, ide::FileType type,
                              const QString& fileName) {
  m_events->files->AfterRemoveFile.fire(project, type, fileName);
  project->fileEvents->AfterRemoveFile.fire(project, type, fileName);
}

void VbeImpl::fireFileClosed(const std::shared_ptr<ProjectImpl>& project, ide::FileType type,
                             const QString& fileName, bool wasDirty) {
  m_events->files->AfterCloseFile.fire(project, type, fileName, wasDirty);
  project->fileEvents->AfterCloseFile.fire(project, type, fileName, wasDirty);
}

void VbeImpl::fireFileWritten(const std::shared_ptr<ProjectImpl>& project, ide::FileType type,
                              const QString& fileName, int result) {
  m_events->files->AfterWriteFile.fire(project, type, fileName, result);
  project->fileEvents->AfterWriteFile.fire(project, type, fileName, result);
}

void VbeImpl::fireControlAdded(const std::shared_ptr<ControlImpl>& control) {
  auto form = control->form();
  auto project = form && form->component() ? form->component()->project() : nullptr;
  m_events->controls->ItemAdded.fire(control);
  if (project) project->controlEvents->ItemAdded.fire(control);
  if (form) m_events->formControlEvents(form.get())->ItemAdded.fire(control);
}

void VbeImpl::fireControlRemoved(const std::shared_ptr<ControlImpl>& control) {
  auto form = control->form();
  auto project = form && form->component() ? form->component()->project() : nullptr;
  m_events->controls->ItemRemoved.fire(control);
  if (project) project->controlEvents->ItemRemoved.fire(control);
  if (form) m_events->formControlEvents(form.get())->ItemRemoved.fire(control);
}

void VbeImpl::fireControlRenamed(const std::shared_ptr<ControlImpl>& control, const QString& oldName,
                                 int oldIndex) {
  auto form = control->form();
  auto project = form && form->component() ? form->component()->project() : nullptr;
  m_events->controls->ItemRenamed.fire(control, oldName, oldIndex);
  if (project) project->controlEvents->ItemRenamed.fire(control, oldName, oldIndex);
  if (form) m_events->formControlEvents(form.get())->ItemRenamed.fire(control, oldName, oldIndex);
}

}  // namespace host
