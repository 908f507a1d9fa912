// SPDX-License-Identifier: MIT
// The IDE's own commands behind its built-in command-bar controls: files and projects (new, open, add,
// remove, save, save as, close, with the usual questions about unsaved changes), the edit commands on the
// focused editor, the views, the Add-In Manager. Failures are told in a message box that names what
// failed; nothing on disk is lost (the model writes every file atomically, and asks before overwriting a
// file another program changed).
#pragma once

#include "host/model/commandbars.h"
#include "host/model/vbe.h"

#include <QObject>
#include <QString>

#include <functional>
#include <memory>
#include <vector>

namespace desktop {

class MainWindow;

class IdeCommands final : public QObject {
  Q_OBJECT

 public:
  explicit IdeCommands(MainWindow& window);

  void run(host::BuiltinCommand command);

  /// Opens a group, project or module file. `replace` closes the open projects first (asking about their
  /// changes). A failure is shown and nothing is opened. Returns whether the file was opened.
  bool open(const QString& path, bool replace);
  /// Saves every project, asking names for projects never saved; false when cancelled or failed.
  bool saveAll();
  bool saveProjectAs(const std::shared_ptr<host::ProjectImpl>& project, QString path = {});
  bool saveComponent(const std::shared_ptr<host::ComponentImpl>& component, bool askName);
  /// Asks whether to save the changes of `projects`; false when the user cancelled (or saving failed).
  bool confirmClose(const std::vector<std::shared_ptr<host::ProjectImpl>>& projects);
  /// Closes a project after asking about its changes.
  bool closeProject(const std::shared_ptr<host::ProjectImpl>& project);
  std::shared_ptr<host::ComponentImpl> addComponent(ide::ComponentType type);
  bool removeComponent(const std::shared_ptr<host::ComponentImpl>& component);
  /// Opens a component's code window, or its designer.
  void show(const std::shared_ptr<host::ComponentImpl>& component, bool code);
  /// The component the commands act on: the selected one, else the active window's.
  std::shared_ptr<host::ComponentImpl> currentComponent() const;
  std::shared_ptr<host::ProjectImpl> currentProject() const;

 private:
  QString askFileName(const QString& title, const QString& filter, const QString& suggestion, bool save);
  /// Runs `save`; when files were changed by another program since they were read, asks whether to
  /// overwrite them and saves again if so. A failure is shown under `failure`, followed by
  /// `nothingChanged` when every file on disk is as it was. Returns whether it saved.
  bool runSave(const std::function<void()>& save, const QString& failure, const QString& nothingChanged = {});
  void editCommand(host::BuiltinCommand command);
  void find();
  void showAddInManager();
  void rememberDirectory(const QString& path);
  QString lastDirectory() const;

  MainWindow& m_window;
  QString m_lastFind;
};

}  // namespace desktop
