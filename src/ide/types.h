// SPDX-License-Identifier: MIT
// Numbers and handles of the object model. Enumerator values are the IDE's own.
#pragma once

#include <QtGlobal>

#include <memory>

namespace ide {

/// Object-model objects are shared: a reference keeps an object usable after it has left the IDE (a
/// removed component's code module still compares equal to itself, but its operations then fail).
template <class T>
using Ref = std::shared_ptr<T>;

/// A window of the IDE (main window, code window, designer, tool window); 0 is no window.
using HWnd = quintptr;

enum class ProcKind : int { Proc = 0, Let = 1, Set = 2, Get = 3 };

enum class ComponentType : int {
  StdModule = 1,
  ClassModule = 2,
  MSForm = 3,
  ResFile = 4,
  VBForm = 5,
  VBMDIForm = 6,
  PropPage = 7,
  UserControl = 8,
  DocObject = 9,
  RelatedDocument = 10,
  ActiveXDesigner = 11,
};

enum class ProjectType : int { StandardExe = 0, ActiveXExe = 1, ActiveXDll = 2, ActiveXControl = 3 };

enum class MemberType : int { Method = 1, Property = 2, Variable = 3, Event = 4, Const = 5 };

enum class Scope : int { Private = 1, Public = 2, Friend = 3 };

enum class WindowType : int {
  CodeWindow = 0,
  Designer = 1,
  Browser = 2,
  Watch = 3,
  Locals = 4,
  Immediate = 5,
  ProjectWindow = 6,
  PropertyWindow = 7,
  Find = 8,
  FindReplace = 9,
  Toolbox = 10,
  LinkedWindowFrame = 11,
  MainWindow = 12,
  Preview = 13,
  ColorPalette = 14,
  ToolWindow = 15,
};

enum class WindowState : int { Normal = 0, Minimize = 1, Maximize = 2 };

enum class DisplayModel : int { SDI = 0, MDI = 1 };

enum class IdeMode : int { Design = 0, Run = 1, Break = 2 };

enum class FileType : int {
  Form = 0,
  Module = 1,
  Class = 2,
  Project = 3,
  Exe = 4,
  Frx = 5,
  Res = 6,
  UserControl = 7,
  PropertyPage = 8,
  DocObject = 9,
  Binary = 10,
  GroupProject = 11,
  Designers = 12,
};

enum class ConnectMode : int { AfterStartup = 0, Startup = 1, External = 2, CommandLine = 3 };
enum class DisconnectMode : int { HostShutdown = 0, UserClosed = 1 };

/// Command-bar control types (only those the IDE's bars use).
enum class ControlType : int { Custom = 0, Button = 1, Edit = 2, Dropdown = 3, ComboBox = 4, Popup = 10 };
enum class ButtonStyle : int { Automatic = 0, Icon = 1, Caption = 2, IconAndCaption = 3 };
enum class BarPosition : int {
  Left = 0,
  Top = 1,
  Right = 2,
  Bottom = 3,
  Floating = 4,
  Popup = 5,
  MenuBar = 6
};

}  // namespace ide
