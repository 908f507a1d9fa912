// SPDX-License-Identifier: MIT
// The IDE's own pictures: the built-in commands, the project window's nodes, the toolbox's controls and
// the code window's view buttons. Each is a pair of PNG files compiled into the program (icons.qrc,
// apps/quimbel-ide/icons/NAME.png at 16 pixels and NAME@2x.png at 32), found through one table.
#pragma once

#include "host/model/commandbars.h"
#include "ide/types.h"

#include <QIcon>
#include <QString>

namespace desktop {

enum class Glyph {
  None,
  NewProject,
  AddProject,
  AddForm,
  AddModule,
  AddClass,
  Open,
  Save,
  Cut,
  Copy,
  Paste,
  Find,
  Undo,
  Redo,
  Start,
  Break,
  End,
  ProjectExplorer,
  Properties,
  Toolbox,
  Remove,
  AddIns,
  Exit,
  ViewCode,
  ViewObject,
  About,
  // Code window
  ProcedureView,
  FullModuleView,
  // Project explorer
  Project,
  Folder,
  Form,
  Module,
  ClassModule,
  Document,
  // Toolbox
  Pointer,
  PictureBox,
  Label,
  TextBox,
  Frame,
  CommandButton,
  CheckBox,
  OptionButton,
  ComboBox,
  ListBox,
  HScrollBar,
  VScrollBar,
  Timer,
  DriveListBox,
  DirListBox,
  FileListBox,
  Shape,
  Line,
  Image,
};

QIcon icon(Glyph glyph);
/// The picture of a built-in command; a null icon for commands without one.
QIcon commandIcon(host::BuiltinCommand command);
QIcon componentIcon(ide::ComponentType type);
/// The toolbox picture of an intrinsic control class ("TextBox" or "VB.TextBox").
QIcon controlIcon(const QString& className);
/// The picture as PNG bytes of a given size (what a command-bar control's Face holds).
QByteArray glyphPng(Glyph glyph, int size = 16);

}  // namespace desktop
