// SPDX-License-Identifier: MIT
// Project identity and the project info file. Every project gets a six-digit identifier, written into a
// standard module the add-in inserts ("basQMInf000101", first line "'PROJID=000101"), and its tasks and
// favourites live in the compound file "qm000101.qmi" beside the project file (in the temporary
// directory while the project has never been saved). One CProjInfo per open project keeps that file open
// and exclusively held, hands out task and favourite identifiers and reads and writes their records:
//
//   root: "\005SummaryInformation", "\005DocumentSummaryInformation" (empty property sets),
//         "LastTaskId", "LastFavoriteId" (one 32-bit integer each),
//         "TaskList" (storage: "Task1", "Task2" ...), "Favorites" (storage: "Favorite1" ...);
//   each record stream holds one string (see records.h).
//
// Every change is committed at once (the whole file is written anew and renamed into place). A file that
// cannot be read (damaged, not a compound file, held by another program) is reported with its path and
// left alone: the project opens without tasks and favourites. A file that cannot be written (a read-only
// folder) is reported once; the tasks and favourites live on in memory for the session.
#pragma once

#include "ide/vbide.h"
#include "projinfo/collection.h"
#include "projinfo/storage/storage.h"

#include <QString>

#include <functional>
#include <memory>
#include <optional>

namespace appdata {
class CAppInfoFile;
}

namespace projinfo {

class CProjInfo;
class CTaskList;

inline constexpr char kIdentityModulePrefix[] = "basQMInf";
inline constexpr char kIdentityMarker[] = "'PROJID=";
inline constexpr char kTaskPrefix[] = "Task";
inline constexpr char kFavoritePrefix[] = "Favorite";

/// A task or favourite as the info file keeps it.
class InfoRecord {
 public:
  virtual ~InfoRecord() = default;
  /// Handed out by CProjInfo, from 1, never reused within a file.
  qint32 ItemId = 0;
  /// The record text; raises when it cannot be built.
  virtual QString Serialization() const = 0;
};

/// The task list or the favourites of a project, as CProjInfo sees them.
class InfoRecordList {
 public:
  virtual ~InfoRecordList() = default;
  /// Loads every record of the file; records that cannot be read are left out (and left in the file).
  virtual void InitializeFromFile() = 0;
  /// CProjInfo adds and removes the entries of the list's collection, keyed "Task12", "Favorite3" ...
  virtual void insertRecord(const QString& key, std::shared_ptr<InfoRecord> item) = 0;
  virtual void removeRecord(const QString& key) = 0;
  /// A component left the project, or was renamed: records that point into it follow.
  virtual void componentRemoved(const ide::Ref<ide::VBComponent>& /*component*/) {}
  virtual void componentRenamed(const ide::Ref<ide::VBComponent>& /*component*/) {}
};

/// What a CProjInfo needs besides its project.
struct ProjInfoServices {
  /// The IDE: its user interface for the messages, its main window, the projects' components.
  ide::VBE* vbe = nullptr;
  /// Hands out the identifiers of new projects; null when the application database is not there
  /// (`appInfoUnavailable` says why), and then projects without an identifier get no info file.
  appdata::CAppInfoFile* appInfo = nullptr;
  QString appInfoUnavailable;
  /// Makes the favourites of a project (none when empty).
  std::function<std::unique_ptr<InfoRecordList>(CProjInfo&)> createFavorites;
  /// Opens the task-list window.
  std::function<void(CTaskList&)> showTasks;
  /// The add-in tells the user about a file that cannot be read or written (once) and works on; the
  /// command-line tool gets every such failure raised instead.
  bool tellUser = true;
  /// The name of another open project whose info object holds the file at `path` (two projects with one
  /// identifier: a copied project, say); empty when none does.
  std::function<QString(const CProjInfo& asking, const QString& path)> projectHolding;
};

/// The identifier module of a project and the identifier it holds.
struct ProjectIdentity {
  ide::Ref<ide::VBComponent> module;
  QString id;
};

/// The identifier in a component, when it is an identifier module: its name begins with "basQMInf" and a
/// line, trimmed, begins with "'PROJID=" followed by six digits (letter case does not matter).
std::optional<QString> IdentityOf(const ide::Ref<ide::VBComponent>& component);
/// The first component, in the project's order, that identifies it.
std::optional<ProjectIdentity> FindProjectId(const ide::Ref<ide::VBProject>& project);
/// "qm" + identifier + ".qmi".
QString infoFileTitle(const QString& id);

class CProjInfo {
 public:
  explicit CProjInfo(ProjInfoServices services);
  /// Closes the file (with failures ignored) and deletes nothing: the project may stay open and be saved
  /// later (the add-in unloaded while the IDE runs on). ProjectClosed says when the file goes.
  ~CProjInfo();
  CProjInfo(const CProjInfo&) = delete;
  CProjInfo& operator=(const CProjInfo&) = delete;

  /// The info file, its favourites and task-list storages (null while the file is not open).
  Storage* fileInfo() const { return m_FileInfo.get(); }
  Storage* favoritesStorage() const { return m_Favorites.get(); }
  Storage* taskListStorage() const { return m_TaskList.get(); }
  /// The directory of the info file.
  const QString& filePath() const { return FilePath; }
  /// The project has a file name and the info file lies beside it.
  bool isSaved() const { return Saved; }
  /// The info file's name.
  const QString& fileTitle() const { return FileTitle; }
  /// The module that ties the project to its file.
  const ide::Ref<ide::VBComponent>& identityModule() const { return basProjInfo; }

  /// Finds the project's identifier module (inserting one, with a new identifier, into a project that has
  /// none) and opens the info file. True when the file is open. A file that cannot be opened is reported
  /// and false returned; failures to find or insert the module are raised.
  bool Initialize();
  void WriteTaskListItem(const QString& name, const QString& text);
  QString GetTaskListItem(const QString& name);
  qint32 GetFavoritesCount();
  void WriteFavoritesItem(const QString& name, const QString& text);
  QString GetFavoritesItem(const QString& name);
  const ide::Ref<ide::VBProject>& Project() const { return m_project; }
  void setProject(ide::Ref<ide::VBProject> project) { m_project = std::move(project); }
  CTaskList* TaskList() const { return m_oTaskList.get(); }
  InfoRecordList* Favorites() const { return m_oFavorites.get(); }
  void DeleteTask(qint32 id);
  void DeleteFavorite(qint32 id);
  qint32 AddTaskListItem(const std::shared_ptr<InfoRecord>& task);
  qint32 AddFavoritesItem(const std::shared_ptr<InfoRecord>& item);
  void CloseFile();
  void OpenFile();

  /// Finds the identifier module without ever inserting one (the command-line tool): false when the
  /// project has none. Opens the file when it has one.
  bool InitializeExisting();
  /// The project file moved to `directory`: the info file goes along (unless it is there already). A
  /// failure is told and leaves the file where it was.
  void ProjectMoved(const QString& directory);
  /// The identifier module was removed or renamed: the file is closed and kept.
  void TieLost();
  /// `component` (added, or renamed) identifies the project again after its tie was lost: the file is
  /// opened again. False, changing nothing, for any other component.
  bool Retie(const ide::Ref<ide::VBComponent>& component);
  bool tieLost() const { return m_tieLost; }
  /// The identifier module kept its tie under a new name.
  void moduleRenamed() { m_moduleName = basProjInfo ? basProjInfo->Name() : QString(); }
  /// The project leaves the IDE: the file is closed, and deleted when the project was never saved or its
  /// new identifier module was not (they go with the project).
  void ProjectClosed();
  /// The info file's path.
  QString path() const { return FilePath + u'/' + FileTitle; }
  bool isOpen() const { return m_FileInfo != nullptr; }
  /// Why the file is not open, for the user; empty while it is.
  const QString& unavailable() const { return m_unavailable; }
  const ProjInfoServices& services() const { return m_services; }

 private:
  std::shared_ptr<Storage> m_FileInfo;
  std::shared_ptr<Storage> m_Favorites;
  std::shared_ptr<Storage> m_TaskList;
  std::unique_ptr<CTaskList> m_oTaskList;
  std::unique_ptr<InfoRecordList> m_oFavorites;
  QString FilePath;
  bool Saved = false;
  QString FileTitle;
  ide::Ref<ide::VBComponent> basProjInfo;

  qint32 NextTaskId();
  qint32 NextFavoriteId();
  qint32 nextId(const char* streamName, qint32& highest);
  void writeRecord(Storage& storage, const QString& name, const QString& text);
  QString readRecord(Storage& storage, const QString& name);
  void deleteRecord(Storage* storage, InfoRecordList* list, const char* prefix, qint32 id);
  qint32 addRecord(Storage* storage, InfoRecordList* list, const char* prefix,
                   const std::shared_ptr<InfoRecord>& item, qint32 id);
  /// The highest identifier among the record streams of `storage` named prefix + number.
  static qint32 highestId(Storage& storage, const char* prefix);
  void findFilePath();
  /// A file of this identifier left in the temporary directory (the add-in was unloaded and the project
  /// first saved meanwhile) comes to the project's folder, when nobody holds it.
  void adoptTemporaryFile();
  /// Writes the file; a failure is told once (and the changes stay in memory) or raised for the tool.
  void commitChanges();
  /// Tells the user `text`, or raises `failure` for the tool.
  void tell(const QString& text, const ide::Error& failure);
  void release();

  ProjInfoServices m_services;
  ide::Ref<ide::VBProject> m_project;
  QString m_unavailable;
  qint32 m_highestTask = 0;
  qint32 m_highestFavorite = 0;
  /// The project's identifier, and the name of its module while it ties the project to the file.
  QString m_id;
  QString m_moduleName;
  /// The file at path() is this project's (open, or closed because the tie was lost): it goes with a
  /// project that is closed without being saved.
  bool m_ownsFile = false;
  bool m_tieLost = false;
  bool m_writeFailed = false;
};

}  // namespace projinfo
