// SPDX-License-Identifier: MIT
// What the commands and the IDE events hand over to the add-in's feature areas (favourites, macros, copy
// buffers, numbering, indentation, extended find, task list, new procedure, options, designer actions,
// project info). CVBEvents calls these at the moments its rules say; features.cpp says what each does
// today, and which areas are not there yet (those calls do nothing).
#pragma once

#include "addin/hotkeys.h"
#include "ide/vbide.h"

#include <QString>

#include <memory>

namespace common {
class SettingsStore;
struct Options;
}  // namespace common
namespace appdata {
class CAppInfoFile;
}
namespace textins {
class TextInsertion;
}

namespace addin {

/// A code place the add-to-favourites item keeps.
struct FavoritePlace {
  ide::Ref<ide::VBProject> project;
  ide::Ref<ide::VBComponent> component;
  /// "General Declarations" outside any procedure.
  QString procName;
  ide::ProcKind procKind = ide::ProcKind::Proc;
  int line = 0;
};

class Features {
 public:
  virtual ~Features() = default;

  // Commands.
  virtual void showFavorites() = 0;
  virtual void showMacros() = 0;
  virtual void showCopyBuffers() = 0;
  virtual void showLineNumbering() = 0;
  virtual void showIndentation() = 0;
  virtual void showExtendedFind() = 0;
  virtual void showTaskList() = 0;
  virtual void showNewProcedure() = 0;
  virtual void showOptions() = 0;
  virtual void addFavorite(const FavoritePlace& place) = 0;

  // Projects and their info files.
  virtual void projectAdded(const ide::Ref<ide::VBProject>& project) = 0;
  /// The project's info file is closed (and deleted when the project was never saved).
  virtual void projectRemoved(const ide::Ref<ide::VBProject>& project) = 0;
  virtual void projectRenamed(const ide::Ref<ide::VBProject>& project, const QString& oldName) = 0;
  /// The project file moved to another directory.
  virtual void projectFileMoved(const ide::Ref<ide::VBProject>& project, const QString& newName,
                                const QString& oldName) = 0;
  /// The module that ties a project to its info file.
  virtual bool isIdentityModule(const ide::Ref<ide::VBComponent>& component) = 0;
  /// Every project's info file is closed: no project is left.
  virtual void allProjectsClosed() = 0;
  /// The add-in is unloaded while the IDE runs on: the projects stay open and may still be saved, so every
  /// info file is closed and none is deleted.
  virtual void projectsStayOpen() {}

  // Components and controls.
  virtual void componentAdded(const ide::Ref<ide::VBComponent>& component) = 0;
  virtual void componentRemoved(const ide::Ref<ide::VBComponent>& component) = 0;
  virtual void componentRenamed(const ide::Ref<ide::VBComponent>& component, const QString& oldName) = 0;
  virtual void controlAdded(const ide::Ref<ide::VBControl>& control) = 0;
  virtual void controlRenamed(const ide::Ref<ide::VBControl>& control, const QString& oldName,
                              int oldIndex) = 0;

  // A project or component left the IDE: the extended find window, when it is visible, drops its rows.
  virtual void findWindowProjectRemoved(const ide::Ref<ide::VBProject>& project) = 0;
  virtual void findWindowComponentRemoved(const ide::Ref<ide::VBComponent>& component) = 0;

  /// The hotkey clients; null while they are not there.
  virtual HotKeyClient* copyBuffers() = 0;
  virtual HotKeyClient* macros() = 0;
};

/// What the add-in hands its feature areas when it creates them; all of it outlives them.
struct FeatureServices {
  ide::Ref<ide::VBE> vbe;
  common::SettingsStore& settings;
  /// The option globals: the options dialog sets them, the designer actions and the numbering and
  /// indentation dialogs read them.
  common::Options& options;
  /// The application database (macros, copy buffers, templates, project identifiers); null when it could
  /// not be opened at start-up. A command that needs it then shows `appInfoUnavailable`, which names the
  /// file and says why.
  appdata::CAppInfoFile* appInfo;
  QString appInfoUnavailable;
  /// InsertText for macros, copy buffers and templates.
  textins::TextInsertion& textInsertion;
  /// Where the help pages are (ending in "/"), and the display model the code-window search follows.
  QString installDir;
  ide::DisplayModel startDisplayModel = ide::DisplayModel::MDI;
};

/// The feature areas as the add-in has them today.
std::unique_ptr<Features> createFeatures(const FeatureServices& services);

}  // namespace addin
