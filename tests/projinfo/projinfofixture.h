// SPDX-License-Identifier: MIT
// Shared helpers of the project-info tests: a headless IDE with its own application database, temporary
// directory and project info objects (favourites included), and projects written on disk in VB6's form.
#pragma once

#include "appdata/appinfofile.h"
#include "host/model/vbe.h"
#include "host/platform/headlessui.h"
#include "printers.h"
#include "projinfo/projinfos.h"
#include "projinfo/tasklist.h"

#include <QStringList>
#include <QTemporaryDir>

#include <memory>

namespace projinfo::test {

class Scene {
 public:
  /// `services` may change what the info objects are given before the first project is added.
  Scene();
  ~Scene();

  QString path(const QString& relative) const { return m_dir.filePath(relative); }
  /// Writes Proj.vbp in `folder` with modules of these names and texts (CRLF lines); returns its path.
  QString writeProject(const QString& folder, const QList<std::pair<QString, QString>>& modules) const;
  /// Opens a project file and announces it to the info objects, as the IDE's event does.
  std::shared_ptr<host::ProjectImpl> open(const QString& vbp);
  std::shared_ptr<host::ProjectImpl> newProject();
  void close(const std::shared_ptr<host::ProjectImpl>& project);
  CProjInfo& info(const std::shared_ptr<host::ProjectImpl>& project) { return *infos->item(project); }
  CTaskList& tasks(const std::shared_ptr<host::ProjectImpl>& project) { return *info(project).TaskList(); }
  std::shared_ptr<CTaskItem> addTask(const std::shared_ptr<host::ProjectImpl>& project, const QString& name,
                                     const QString& text = {});
  /// The texts of the message boxes shown since the last call.
  QStringList takeMessages();

  appdata::CAppInfoFile appInfo;
  std::shared_ptr<host::VbeImpl> vbe = host::VbeImpl::create();
  ProjInfoServices services;
  std::unique_ptr<ProjInfos> infos;

 private:
  QTemporaryDir m_dir;
  QByteArray m_oldTemp;
};

/// The names of the streams in a storage of an info file on disk, read as another program would.
QStringList streamsOf(const QString& infoFile, const QString& storage);

}  // namespace projinfo::test
