// SPDX-License-Identifier: MIT
// The IDE's menus and toolbars as data. A popup control owns a bar of its own; bars and popup bars with a
// name are found by it ("Add-Ins" is the Add-Ins menu's bar). Every change is announced, so that a desktop
// host can draw the bars live; a click fires every connected click sink, then the IDE's own command when
// no sink cancelled it.
#pragma once

#include "ide/commandbars.h"
#include "ide/signal.h"
#include "ide/vbide.h"

#include <functional>
#include <memory>
#include <vector>

namespace host {

class CommandBarImpl;
class CommandBarsImpl;

/// The IDE's own commands behind its built-in controls (the desktop host connects what they do).
enum class BuiltinCommand : int {
  None = 0,
  NewProject = 2001,
  OpenProject,
  AddProject,
  RemoveProject,
  SaveProject,
  SaveProjectAs,
  SaveFile,
  SaveFileAs,
  Exit,
  Undo,
  Redo,
  Cut,
  Copy,
  Paste,
  Find,
  AddForm,
  AddModule,
  AddClass,
  RemoveComponent,
  ViewCode,
  ViewObject,
  ViewProjectExplorer,
  ViewProperties,
  ViewToolbox,
  Start,
  Continue,
  Break,
  End,
  AddInManager,
  About,
  Options,
};

class CommandBarControlImpl final : public ide::CommandBarControl,
                                    public std::enable_shared_from_this<CommandBarControlImpl> {
 public:
  CommandBarControlImpl(CommandBarsImpl& bars, ide::ControlType type, int id, bool temporary);

  ide::ControlType Type() override { return m_type; }
  int Id() override { return m_id; }
  QString Caption() override { return m_caption; }
  void setCaption(const QString& caption) override;
  QString Tag() override { return m_tag; }
  void setTag(const QString& tag) override;
  QString TooltipText() override { return m_tooltip; }
  void setTooltipText(const QString& text) override;
  QString Parameter() override { return m_parameter; }
  void setParameter(const QString& parameter) override;
  bool Enabled() override { return m_enabled; }
  void setEnabled(bool enabled) override;
  bool Visible() override { return m_visible; }
  void setVisible(bool visible) override;
  bool BeginGroup() override { return m_beginGroup; }
  void setBeginGroup(bool beginGroup) override;
  ide::ButtonStyle Style() override { return m_style; }
  void setStyle(ide::ButtonStyle style) override;
  QByteArray Face() override { return m_face; }
  void setFace(const QByteArray& imageData) override;
  bool Temporary() override { return m_temporary; }
  int Index() override;
  ide::Ref<ide::CommandBar> Parent() override;
  ide::Ref<ide::CommandBar> CommandBar() override;
  void Execute() override;
  void Delete() override;

  ide::Ref<ide::CommandBarEventSource> clickSource();
  BuiltinCommand builtin() const { return m_builtin; }
  void setBuiltin(BuiltinCommand command) { m_builtin = command; }
  bool deleted() const { return m_deleted; }
  std::shared_ptr<CommandBarImpl> popupBar() const { return m_popup; }
  void setPopupBar(std::shared_ptr<CommandBarImpl> bar) { m_popup = std::move(bar); }
  void setParentBar(const std::shared_ptr<CommandBarImpl>& bar) { m_parent = bar; }
  void markDeleted();

 private:
  void changed();

  CommandBarsImpl& m_bars;
  ide::ControlType m_type;
  int m_id;
  bool m_temporary;
  QString m_caption;
  QString m_tag;
  QString m_tooltip;
  QString m_parameter;
  bool m_enabled = true;
  bool m_visible = true;
  bool m_beginGroup = false;
  ide::ButtonStyle m_style = ide::ButtonStyle::Automatic;
  QByteArray m_face;
  bool m_deleted = false;
  BuiltinCommand m_builtin = BuiltinCommand::None;
  std::weak_ptr<CommandBarImpl> m_parent;
  std::shared_ptr<CommandBarImpl> m_popup;
  std::shared_ptr<ide::CommandBarEventSource> m_clicks;
};

class CommandBarImpl final : public ide::CommandBar,
                             public ide::CommandBarControls,
                             public std::enable_shared_from_this<CommandBarImpl> {
 public:
  CommandBarImpl(CommandBarsImpl& bars, QString name, ide::BarPosition position, bool builtIn);

  // ide::CommandBar
  QString Name() override { return m_name; }
  ide::BarPosition Position() override { return m_position; }
  int Index() override;
  bool BuiltIn() override { return m_builtIn; }
  bool Visible() override { return m_visible; }
  void setVisible(bool visible) override;
  bool Enabled() override { return true; }
  ide::Ref<ide::CommandBarControls> Controls() override;
  void Delete() override;

  // ide::CommandBarControls
  int Count() override { return static_cast<int>(m_controls.size()); }
  ide::Ref<ide::CommandBarControl> Item(int index) override;
  ide::Ref<ide::CommandBarControl> Item(const QString& caption) override;
  ide::Ref<ide::CommandBarControl> Add(ide::ControlType type, int id, const QVariant& parameter, int before,
                                       bool temporary) override;
  ide::Ref<ide::CommandBar> Parent() override { return shared_from_this(); }

  /// Builds a built-in control (setup of the IDE's own bars).
  std::shared_ptr<CommandBarControlImpl> addBuiltin(ide::ControlType type, const QString& caption,
                                                    BuiltinCommand command = BuiltinCommand::None,
                                                    bool beginGroup = false);
  const std::vector<std::shared_ptr<CommandBarControlImpl>>& controls() const { return m_controls; }
  std::shared_ptr<CommandBarControlImpl> findControl(const QString& caption) const;
  int indexOf(const CommandBarControlImpl* control) const;
  void removeControl(const CommandBarControlImpl* control);
  bool deleted() const { return m_deleted; }
  void markDeleted();
  /// The popup control that opens this bar (empty for a top-level bar).
  std::shared_ptr<CommandBarControlImpl> owner() const { return m_owner.lock(); }
  void setOwner(const std::shared_ptr<CommandBarControlImpl>& owner) { m_owner = owner; }

 private:
  CommandBarsImpl& m_bars;
  QString m_name;
  ide::BarPosition m_position;
  bool m_builtIn;
  bool m_visible = true;
  bool m_deleted = false;
  std::vector<std::shared_ptr<CommandBarControlImpl>> m_controls;
  std::weak_ptr<CommandBarControlImpl> m_owner;
};

class CommandBarsImpl final : public ide::CommandBars {
 public:
  CommandBarsImpl();
  ~CommandBarsImpl() override;

  int Count() override { return static_cast<int>(m_bars.size()); }
  ide::Ref<ide::CommandBar> Item(int index) override;
  ide::Ref<ide::CommandBar> Item(const QString& name) override;
  ide::Ref<ide::CommandBar> Add(const QString& name, ide::BarPosition position, bool menuBar,
                                bool temporary) override;

  const std::vector<std::shared_ptr<CommandBarImpl>>& bars() const { return m_bars; }
  std::shared_ptr<CommandBarImpl> bar(const QString& name) const;
  int indexOf(const CommandBarImpl* bar) const;
  void removeBar(const CommandBarImpl* bar);
  /// Announces a change of a bar or of one of its controls.
  void notifyChanged(CommandBarImpl* bar);
  /// Runs an IDE command (set by the IDE model).
  void setCommandHandler(std::function<void(BuiltinCommand)> handler) { m_handler = std::move(handler); }
  void runCommand(BuiltinCommand command);
  /// The control of an IDE command, wherever it stands.
  std::shared_ptr<CommandBarControlImpl> findBuiltin(BuiltinCommand command) const;

  /// Emitted after any change (nullptr: the set of bars changed).
  ide::Signal<CommandBarImpl*> changed;

  /// Builds the IDE's own bars: "Menu Bar" with its thirteen menus, "Standard", "Edit", "Debug",
  /// "Form Editor", and the context menus "Code Window", "Code Window (Break)" and "Project Window".
  void buildStandardBars();

 private:
  std::vector<std::shared_ptr<CommandBarImpl>> m_bars;
  std::function<void(BuiltinCommand)> m_handler;
};

/// Captions compare without "&" marks and without regard to case, as the IDE's do.
bool sameCaption(const QString& a, const QString& b);

}  // namespace host
