// SPDX-License-Identifier: MIT
#include "host/model/commandbars.h"

#include "ide/error.h"

namespace host {

bool sameCaption(const QString& a, const QString& b) {
  QString left = a;
  QString right = b;
  left.remove(u'&');
  right.remove(u'&');
  return left.compare(right, Qt::CaseInsensitive) == 0;
}

// ---------------------------------------------------------------------------------------------------
// Controls

CommandBarControlImpl::CommandBarControlImpl(CommandBarsImpl& bars, ide::ControlType type, int id,
                                             bool temporary)
    : m_bars(bars), m_type(type), m_id(id), m_temporary(temporary) {}

void CommandBarControlImpl::changed() {
  if (m_deleted) return;
  if (auto bar = m_parent.lock()) m_bars.notifyChanged(bar.get());
}

void CommandBarControlImpl::setCaption(const QString& caption) {
  m_caption = caption;
  changed();
}
void CommandBarControlImpl::setTag(const QString& tag) {
  m_tag = tag;
  changed();
}
void CommandBarControlImpl::setTooltipText(const QString& text) {
  m_tooltip = text;
  changed();
}
void CommandBarControlImpl::setParameter(const QString& parameter) {
  m_parameter = parameter;
}
void CommandBarControlImpl::setEnabled(bool enabled) {
  if (m_enabled == enabled) return;
  m_enabled = enabled;
  changed();
}
void CommandBarControlImpl::setVisible(bool visible) {
  if (m_visible == visible) return;
  m_visible = visible;
  changed();
}
void CommandBarControlImpl::setBeginGroup(bool beginGroup) {
  m_beginGroup = beginGroup;
  changed();
}
void CommandBarControlImpl::setStyle(ide::ButtonStyle style) {
  m_style = style;
  changed();
}
void CommandBarControlImpl::setFace(const QByteArray& imageData) {
  m_face = imageData;
  changed();
}

int CommandBarControlImpl::Index() {
  auto bar = m_parent.lock();
  return bar ? bar->indexOf(this) : 0;
}

ide::Ref<ide::CommandBar> CommandBarControlImpl::Parent() {
  return m_parent.lock();
}

ide::Ref<ide::CommandBar> CommandBarControlImpl::CommandBar() {
  return m_popup;
}

ide::Ref<ide::CommandBarEventSource> CommandBarControlImpl::clickSource() {
  if (!m_clicks) m_clicks = std::make_shared<ide::CommandBarEventSource>();
  return m_clicks;
}

void CommandBarControlImpl::Execute() {
  if (m_deleted) ide::raise(ide::err::ObjectVariableNotSet);
  auto self = shared_from_this();  // a sink may delete the control while we run
  bool handled = false;
  bool cancelDefault = false;
  if (m_clicks) m_clicks->Click.fire(self, handled, cancelDefault);
  if (!cancelDefault && m_builtin != BuiltinCommand::None) m_bars.runCommand(m_builtin);
}

void CommandBarControlImpl::markDeleted() {
  m_deleted = true;
  if (m_popup) m_popup->markDeleted();
}

void CommandBarControlImpl::Delete() {
  if (m_deleted) ide::raise(ide::err::ObjectVariableNotSet);
  auto self = shared_from_this();
  if (auto bar = m_parent.lock()) bar->removeControl(this);
  markDeleted();
}

// ---------------------------------------------------------------------------------------------------
// Bars

CommandBarImpl::CommandBarImpl(CommandBarsImpl& bars, QString name, ide::BarPosition position, bool builtIn)
    : m_bars(bars), m_name(std::move(name)), m_position(position), m_builtIn(builtIn) {}

int CommandBarImpl::Index() {
  if (auto owner = m_owner.lock()) return owner->Index();
  return m_bars.indexOf(this);
}

void CommandBarImpl::setVisible(bool visible) {
  if (m_visible == visible) return;
  m_visible = visible;
  m_bars.notifyChanged(this);
}

ide::Ref<ide::CommandBarControls> CommandBarImpl::Controls() {
  if (m_deleted) ide::raise(ide::err::ObjectVariableNotSet);
  return std::static_pointer_cast<ide::CommandBarControls>(shared_from_this());
}

void CommandBarImpl::Delete() {
  if (m_deleted) ide::raise(ide::err::ObjectVariableNotSet);
  if (m_builtIn || m_owner.lock()) ide::raise(ide::err::InvalidProcedureCall);
  auto self = shared_from_this();
  m_bars.removeBar(this);
  markDeleted();
}

void CommandBarImpl::markDeleted() {
  m_deleted = true;
  for (const auto& control : m_controls)
    control->markDeleted();
}

ide::Ref<ide::CommandBarControl> CommandBarImpl::Item(int index) {
  if (index < 1 || index > Count()) ide::raise(ide::err::InvalidProcedureCall);
  return m_controls[static_cast<size_t>(index - 1)];
}

ide::Ref<ide::CommandBarControl> CommandBarImpl::Item(const QString& caption) {
  if (auto control = findControl(caption)) return control;
  ide::raise(ide::err::InvalidProcedureCall);
}

std::shared_ptr<CommandBarControlImpl> CommandBarImpl::findControl(const QString& caption) const {
  for (const auto& control : m_controls)
    if (sameCaption(control->Caption(), caption)) return control;
  return nullptr;
}

ide::Ref<ide::CommandBarControl> CommandBarImpl::Add(ide::ControlType type, int id, const QVariant& parameter,
                                                     int before, bool temporary) {
  if (m_deleted) ide::raise(ide::err::ObjectVariableNotSet);
  if (before < 0 || before > Count() + 1) ide::raise(ide::err::InvalidProcedureCall);
  if (type != ide::ControlType::Button && type != ide::ControlType::Popup && type != ide::ControlType::Edit &&
      type != ide::ControlType::Dropdown && type != ide::ControlType::ComboBox)
    ide::raise(ide::err::InvalidProcedureCall);
  auto control = std::make_shared<CommandBarControlImpl>(m_bars, type, id, temporary);
  control->setParentBar(shared_from_this());
  if (parameter.isValid()) control->setParameter(parameter.toString());
  if (type == ide::ControlType::Popup) {
    // Added popups are the add-ins' own menus: their bars have no name of their own to be found by.
    auto popup = std::make_shared<CommandBarImpl>(m_bars, QString(), ide::BarPosition::Popup, false);
    popup->setOwner(control);
    control->setPopupBar(std::move(popup));
  }
  const size_t at = before == 0 ? m_controls.size() : static_cast<size_t>(before - 1);
  m_controls.insert(m_controls.begin() + static_cast<std::ptrdiff_t>(at), control);
  m_bars.notifyChanged(this);
  return control;
}

std::shared_ptr<CommandBarControlImpl> CommandBarImpl::addBuiltin(ide::ControlType type,
                                                                  const QString& caption,
                                                                  BuiltinCommand command, bool beginGroup) {
  auto control = std::static_pointer_cast<CommandBarControlImpl>(Add(type, 1, {}, 0, false));
  control->setCaption(caption);
  control->setBuiltin(command);
  control->setBeginGroup(beginGroup);
  if (auto popup = control->popupBar()) {
    QString name = caption;
    name.remove(u'&');
    popup->m_name = name;
    popup->m_builtIn = true;
  }
  return control;
}

int CommandBarImpl::indexOf(const CommandBarControlImpl* control) const {
  for (size_t i = 0; i < m_controls.size(); ++i)
    if (m_controls[i].get() == control) return static_cast<int>(i) + 1;
  return 0;
}

void CommandBarImpl::removeControl(const CommandBarControlImpl* control) {
  std::erase_if(m_controls, [control](const auto& c) { return c.get() == control; });
  m_bars.notifyChanged(this);
}

// ---------------------------------------------------------------------------------------------------
// The collection

CommandBarsImpl::CommandBarsImpl() = default;
CommandBarsImpl::~CommandBarsImpl() = default;

ide::Ref<ide::CommandBar> CommandBarsImpl::Item(int index) {
  if (index < 1 || index > Count()) ide::raise(ide::err::InvalidProcedureCall);
  return m_bars[static_cast<size_t>(index - 1)];
}

ide::Ref<ide::CommandBar> CommandBarsImpl::Item(const QString& name) {
  if (auto found = bar(name)) return found;
  ide::raise(ide::err::InvalidProcedureCall);
}

namespace {
std::shared_ptr<CommandBarImpl> findIn(const std::vector<std::shared_ptr<CommandBarImpl>>& bars,
                                       const QString& name) {
  for (const auto& bar : bars)
    if (!bar->deleted() && bar->Name().compare(name, Qt::CaseInsensitive) == 0) return bar;
  for (const auto& bar : bars) {
    std::vector<std::shared_ptr<CommandBarImpl>> popups;
    for (const auto& control : bar->controls())
      if (auto popup = control->popupBar(); popup && popup->BuiltIn()) popups.push_back(popup);
    if (auto found = findIn(popups, name)) return found;
  }
  return nullptr;
}
}  // namespace

std::shared_ptr<CommandBarImpl> CommandBarsImpl::bar(const QString& name) const {
  return findIn(m_bars, name);
}

ide::Ref<ide::CommandBar> CommandBarsImpl::Add(const QString& name, ide::BarPosition position, bool menuBar,
                                               bool /*temporary*/) {
  if (!name.isEmpty() && bar(name)) ide::raise(ide::err::InvalidProcedureCall);
  auto created =
      std::make_shared<CommandBarImpl>(*this, name, menuBar ? ide::BarPosition::MenuBar : position, false);
  m_bars.push_back(created);
  notifyChanged(nullptr);
  return created;
}

int CommandBarsImpl::indexOf(const CommandBarImpl* bar) const {
  for (size_t i = 0; i < m_bars.size(); ++i)
    if (m_bars[i].get() == bar) return static_cast<int>(i) + 1;
  return 0;
}

void CommandBarsImpl::removeBar(const CommandBarImpl* bar) {
  std::erase_if(m_bars, [bar](const auto& b) { return b.get() == bar; });
  notifyChanged(nullptr);
}

void CommandBarsImpl::notifyChanged(CommandBarImpl* bar) {
  changed.fire(bar);
}

void CommandBarsImpl::runCommand(BuiltinCommand command) {
  if (m_handler) m_handler(command);
}

std::shared_ptr<CommandBarControlImpl> CommandBarsImpl::findBuiltin(BuiltinCommand command) const {
  std::function<std::shared_ptr<CommandBarControlImpl>(const CommandBarImpl&)> search =
      [&](const CommandBarImpl& bar) -> std::shared_ptr<CommandBarControlImpl> {
    for (const auto& control : bar.controls()) {
      if (control->builtin() == command) return control;
      if (auto popup = control->popupBar())
        if (auto found = search(*popup)) return found;
    }
    return nullptr;
  };
  for (const auto& bar : m_bars)
    if (auto found = search(*bar)) return found;
  return nullptr;
}

void CommandBarsImpl::buildStandardBars() {
  using ide::ControlType;
  using B = BuiltinCommand;
  auto addBar = [&](const QString& name, ide::BarPosition position, bool visible) {
    auto bar = std::make_shared<CommandBarImpl>(*this, name, position, true);
    bar->setVisible(visible);
    m_bars.push_back(bar);
    return bar;
  };
  auto menu = [](const std::shared_ptr<CommandBarImpl>& bar, const QString& caption) {
    return bar->addBuiltin(ControlType::Popup, caption)->popupBar();
  };
  auto item = [](const std::shared_ptr<CommandBarImpl>& bar, const QString& caption, B command = B::None,
                 bool group = false) {
    return bar->addBuiltin(ControlType::Button, caption, command, group);
  };

  auto menuBar = addBar(QStringLiteral("Menu Bar"), ide::BarPosition::MenuBar, true);
  auto file = menu(menuBar, QStringLiteral("&File"));
  item(file, QStringLiteral("&New Project"), B::NewProject);
  item(file, QStringLiteral("&Open Project..."), B::OpenProject);
  item(file, QStringLiteral("A&dd Project..."), B::AddProject);
  item(file, QStringLiteral("Re&move Project"), B::RemoveProject);
  item(file, QStringLiteral("Sa&ve Project"), B::SaveProject, true);
  item(file, QStringLiteral("Sav&e Project As..."), B::SaveProjectAs);
  item(file, QStringLiteral("&Save File"), B::SaveFile, true);
  item(file, QStringLiteral("Save File &As..."), B::SaveFileAs);
  item(file, QStringLiteral("E&xit"), B::Exit, true);
  auto edit = menu(menuBar, QStringLiteral("&Edit"));
  item(edit, QStringLiteral("&Undo"), B::Undo);
  item(edit, QStringLiteral("&Redo"), B::Redo);
  item(edit, QStringLiteral("Cu&t"), B::Cut, true);
  item(edit, QStringLiteral("&Copy"), B::Copy);
  item(edit, QStringLiteral("&Paste"), B::Paste);
  item(edit, QStringLiteral("&Find..."), B::Find, true);
  auto view = menu(menuBar, QStringLiteral("&View"));
  item(view, QStringLiteral("&Code"), B::ViewCode);
  item(view, QStringLiteral("O&bject"), B::ViewObject);
  item(view, QStringLiteral("Project E&xplorer"), B::ViewProjectExplorer, true);
  item(view, QStringLiteral("Properties &Window"), B::ViewProperties);
  item(view, QStringLiteral("Toolbo&x"), B::ViewToolbox);
  auto project = menu(menuBar, QStringLiteral("&Project"));
  item(project, QStringLiteral("Add &Form"), B::AddForm);
  item(project, QStringLiteral("Add &Module"), B::AddModule);
  item(project, QStringLiteral("Add &Class Module"), B::AddClass);
  item(project, QStringLiteral("&Remove Component"), B::RemoveComponent, true);
  auto format = menu(menuBar, QStringLiteral("F&ormat"));
  item(format, QStringLiteral("&Lock Controls"))->setEnabled(false);
  auto debug = menu(menuBar, QStringLiteral("&Debug"));
  item(debug, QStringLiteral("Step &Into"))->setEnabled(false);
  item(debug, QStringLiteral("Toggle &Breakpoint"))->setEnabled(false);
  auto run = menu(menuBar, QStringLiteral("&Run"));
  item(run, QStringLiteral("&Start"), B::Start);
  item(run, QStringLiteral("&Continue"), B::Continue)->setEnabled(false);
  item(run, QStringLiteral("Brea&k"), B::Break)->setEnabled(false);
  item(run, QStringLiteral("&End"), B::End)->setEnabled(false);
  menu(menuBar, QStringLiteral("&Query"));
  menu(menuBar, QStringLiteral("D&iagram"));
  auto tools = menu(menuBar, QStringLiteral("&Tools"));
  item(tools, QStringLiteral("&Options..."), B::Options);
  auto addIns = menu(menuBar, QStringLiteral("&Add-Ins"));
  item(addIns, QStringLiteral("&Add-In Manager..."), B::AddInManager);
  menu(menuBar, QStringLiteral("&Window"));
  auto help = menu(menuBar, QStringLiteral("&Help"));
  item(help, QStringLiteral("&About Quimbel IDE..."), B::About);

  auto standard = addBar(QStringLiteral("Standard"), ide::BarPosition::Top, true);
  item(standard, QStringLiteral("Add Project"), B::AddProject);
  item(standard, QStringLiteral("Add Form"), B::AddForm);
  item(standard, QStringLiteral("Open Project"), B::OpenProject);
  item(standard, QStringLiteral("Save Project"), B::SaveProject);
  item(standard, QStringLiteral("Cut"), B::Cut, true);
  item(standard, QStringLiteral("Copy"), B::Copy);
  item(standard, QStringLiteral("Paste"), B::Paste);
  item(standard, QStringLiteral("Find"), B::Find);
  item(standard, QStringLiteral("Undo"), B::Undo, true);
  item(standard, QStringLiteral("Redo"), B::Redo);
  item(standard, QStringLiteral("Start"), B::Start, true);
  auto continueButton = item(standard, QStringLiteral("Continue"), B::Continue);
  continueButton->setEnabled(false);
  continueButton->setVisible(false);
  item(standard, QStringLiteral("Break"), B::Break)->setEnabled(false);
  item(standard, QStringLiteral("End"), B::End)->setEnabled(false);
  item(standard, QStringLiteral("Project Explorer"), B::ViewProjectExplorer, true);
  item(standard, QStringLiteral("Properties Window"), B::ViewProperties);
  item(standard, QStringLiteral("Toolbox"), B::ViewToolbox);

  auto editBar = addBar(QStringLiteral("Edit"), ide::BarPosition::Top, false);
  item(editBar, QStringLiteral("Indent"));
  item(editBar, QStringLiteral("Outdent"));
  auto debugBar = addBar(QStringLiteral("Debug"), ide::BarPosition::Top, false);
  item(debugBar, QStringLiteral("Step Into"));
  auto formEditor = addBar(QStringLiteral("Form Editor"), ide::BarPosition::Top, false);
  item(formEditor, QStringLiteral("Bring to Front"));

  auto codeWindow = addBar(QStringLiteral("Code Window"), ide::BarPosition::Popup, false);
  item(codeWindow, QStringLiteral("Cu&t"), B::Cut);
  item(codeWindow, QStringLiteral("&Copy"), B::Copy);
  item(codeWindow, QStringLiteral("&Paste"), B::Paste);
  item(codeWindow, QStringLiteral("&Find..."), B::Find, true);
  item(codeWindow, QStringLiteral("View Obj&ect"), B::ViewObject, true);
  auto codeWindowBreak = addBar(QStringLiteral("Code Window (Break)"), ide::BarPosition::Popup, false);
  item(codeWindowBreak, QStringLiteral("Cu&t"), B::Cut);
  item(codeWindowBreak, QStringLiteral("&Copy"), B::Copy);
  item(codeWindowBreak, QStringLiteral("&Paste"), B::Paste);
  item(codeWindowBreak, QStringLiteral("Add &Watch..."), B::None, true)->setEnabled(false);
  auto projectWindow = addBar(QStringLiteral("Project Window"), ide::BarPosition::Popup, false);
  item(projectWindow, QStringLiteral("View &Code"), B::ViewCode);
  item(projectWindow, QStringLiteral("View &Object"), B::ViewObject);
  item(projectWindow, QStringLiteral("&Remove"), B::RemoveComponent, true);
  notifyChanged(nullptr);
}

}  // namespace host
