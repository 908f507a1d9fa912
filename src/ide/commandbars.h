// SPDX-License-Identifier: MIT
// The IDE's menus and toolbars as command bars: bars hold controls, popup controls hold a bar of their own.
// Captions are matched case-insensitively and without their "&" access-key marks.
#pragma once

#include "ide/types.h"

#include <QByteArray>
#include <QString>
#include <QVariant>

namespace ide {

class CommandBar;
class CommandBarControls;

class CommandBarControl {
 public:
  virtual ~CommandBarControl() = default;

  virtual ControlType Type() = 0;
  virtual int Id() = 0;
  virtual QString Caption() = 0;
  virtual void setCaption(const QString& caption) = 0;
  virtual QString Tag() = 0;
  virtual void setTag(const QString& tag) = 0;
  virtual QString TooltipText() = 0;
  virtual void setTooltipText(const QString& text) = 0;
  virtual QString Parameter() = 0;
  virtual void setParameter(const QString& parameter) = 0;
  virtual bool Enabled() = 0;
  virtual void setEnabled(bool enabled) = 0;
  virtual bool Visible() = 0;
  virtual void setVisible(bool visible) = 0;
  virtual bool BeginGroup() = 0;
  virtual void setBeginGroup(bool beginGroup) = 0;
  virtual ButtonStyle Style() = 0;
  virtual void setStyle(ButtonStyle style) = 0;
  /// The button's picture as image-file bytes (PNG, XPM or SVG); set directly, never through the clipboard.
  virtual QByteArray Face() = 0;
  virtual void setFace(const QByteArray& imageData) = 0;
  virtual bool Temporary() = 0;
  /// 1-based position within its bar.
  virtual int Index() = 0;
  virtual Ref<ide::CommandBar> Parent() = 0;
  /// The bar a popup control opens; empty for other controls.
  virtual Ref<ide::CommandBar> CommandBar() = 0;
  /// Clicks the control: every connected click sink is called.
  virtual void Execute() = 0;
  /// Removes the control from its bar (error 91 when it is gone already).
  virtual void Delete() = 0;
};

class CommandBarControls {
 public:
  virtual ~CommandBarControls() = default;
  virtual int Count() = 0;
  /// Error 5 when there is no such control.
  virtual Ref<CommandBarControl> Item(int index) = 0;
  virtual Ref<CommandBarControl> Item(const QString& caption) = 0;
  /// Adds a control before position `before` (0 or Count + 1 appends); a temporary control disappears when
  /// the IDE closes.
  virtual Ref<CommandBarControl> Add(ControlType type = ControlType::Button, int id = 1,
                                     const QVariant& parameter = {}, int before = 0,
                                     bool temporary = false) = 0;
  virtual Ref<ide::CommandBar> Parent() = 0;
};

class CommandBar {
 public:
  virtual ~CommandBar() = default;
  virtual QString Name() = 0;
  virtual BarPosition Position() = 0;
  virtual int Index() = 0;
  virtual bool BuiltIn() = 0;
  virtual bool Visible() = 0;
  virtual void setVisible(bool visible) = 0;
  virtual bool Enabled() = 0;
  virtual Ref<CommandBarControls> Controls() = 0;
  /// Removes a custom bar; error 5 for the IDE's own bars.
  virtual void Delete() = 0;
};

class CommandBars {
 public:
  virtual ~CommandBars() = default;
  virtual int Count() = 0;
  virtual Ref<CommandBar> Item(int index) = 0;
  /// By name ("Menu Bar", "Standard", "Code Window", "Add-Ins" ...); error 5 when there is none.
  virtual Ref<CommandBar> Item(const QString& name) = 0;
  virtual Ref<CommandBar> Add(const QString& name, BarPosition position = BarPosition::Top,
                              bool menuBar = false, bool temporary = false) = 0;
};

}  // namespace ide
