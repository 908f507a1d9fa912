// SPDX-License-Identifier: MIT
// IDE utility operations of the add-in: the selected text, the kind of a property procedure, the IDE's
// mode, and building the add-in's menu items and toolbar. Controls the add-in adds are owned by
// OwnedControl / OwnedBar, which delete them from the IDE when released.
#pragma once

#include "ide/vbide.h"

#include <QString>

namespace addin {

/// A command-bar control the add-in added; deleted from its bar when released (a control that is gone
/// already is no failure).
class OwnedControl {
 public:
  OwnedControl() = default;
  explicit OwnedControl(ide::Ref<ide::CommandBarControl> control) : m_control(std::move(control)) {}
  OwnedControl(OwnedControl&& other) noexcept : m_control(std::move(other.m_control)) {}
  OwnedControl& operator=(OwnedControl&& other) noexcept;
  ~OwnedControl() { release(); }

  const ide::Ref<ide::CommandBarControl>& get() const { return m_control; }
  ide::CommandBarControl* operator->() const { return m_control.get(); }
  explicit operator bool() const { return m_control != nullptr; }
  /// Deletes the control now.
  void release() noexcept;

 private:
  ide::Ref<ide::CommandBarControl> m_control;
};

/// A command bar the add-in added; deleted with its controls when released.
class OwnedBar {
 public:
  OwnedBar() = default;
  explicit OwnedBar(ide::Ref<ide::CommandBar> bar) : m_bar(std::move(bar)) {}
  OwnedBar(OwnedBar&& other) noexcept : m_bar(std::move(other.m_bar)) {}
  OwnedBar& operator=(OwnedBar&& other) noexcept;
  ~OwnedBar() { release(); }

  const ide::Ref<ide::CommandBar>& get() const { return m_bar; }
  ide::CommandBar* operator->() const { return m_bar.get(); }
  explicit operator bool() const { return m_bar != nullptr; }
  void release() noexcept;

 private:
  ide::Ref<ide::CommandBar> m_bar;
};

class CEnvUtils {
 public:
  explicit CEnvUtils(ide::VBE& vbe) : m_vbe(vbe) {}
  CEnvUtils(const CEnvUtils&) = delete;
  CEnvUtils& operator=(const CEnvUtils&) = delete;

  /// The text selected in the active code pane (lines joined by CRLF); empty without a selection.
  QString GetSelectedText();
  /// The kind of the property procedure `procName` whose lines hold `line`: Get, then Let, then Set are
  /// tried; Proc when none of them holds it.
  ide::ProcKind GetPropertyType(const ide::Ref<ide::CodeModule>& codmod, const QString& procName, int line);
  /// Adds a temporary button before `position` of `menu` (0 appends) with `caption`; `separator` starts a
  /// group before it; a `bitmap` above 0 becomes its picture, shown with the caption.
  OwnedControl AddMenuItem(const ide::Ref<ide::CommandBar>& menu, const QString& caption, int position,
                           bool separator, int bitmap);
  /// Builds the toolbar "Quimbel 2.2" with a button for each toolbar command, at the top of the IDE.
  OwnedBar AddToolBar();

  /// The IDE's mode as its "Standard" bar shows it: "Continue" enabled is break mode, else "End" enabled
  /// is run mode, else design mode.
  ide::IdeMode IdeMode();

 private:
  bool isStandardControlEnabled(const QString& caption, ide::Ref<ide::CommandBarControl>& cached);

  ide::VBE& m_vbe;
  // Looked up once: the timer asks for the mode ten times a second.
  ide::Ref<ide::CommandBarControl> m_continueControl;
  ide::Ref<ide::CommandBarControl> m_endControl;
};

}  // namespace addin
