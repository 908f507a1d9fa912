// SPDX-License-Identifier: MIT
// ProjInfos: one CProjInfo per open project, kept in step with the IDE's project and component events.
// Closing a project closes its info file and deletes no task and no favourite (only a project that was
// never saved takes its file with it); only a component really removed from its project takes its
// favourites along. The identifier module's removal or renaming loses the tie to the file, which is
// closed and kept, and opened again when the module comes back (renamed back, or added again). Two open
// projects with one identifier never share the file: the first keeps it.
#pragma once

#include "projinfo/projinfo.h"

#include <memory>
#include <vector>

namespace projinfo {

class ProjInfos {
 public:
  explicit ProjInfos(ProjInfoServices services);
  /// Closes every info file.
  ~ProjInfos();
  ProjInfos(const ProjInfos&) = delete;
  ProjInfos& operator=(const ProjInfos&) = delete;

  /// The info object of a project; null for a project it does not know.
  CProjInfo* item(const ide::Ref<ide::VBProject>& project) const;
  int count() const { return static_cast<int>(m_items.size()); }

  /// A new info object for the project, initialised (the project's file opened or reported). Raises what
  /// Initialize raises; the object stays, without its file, and says why.
  void projectAdded(const ide::Ref<ide::VBProject>& project);
  /// Closes the project's info file (deleted when the project was never saved) and forgets the project.
  void projectRemoved(const ide::Ref<ide::VBProject>& project);
  /// The project file now is `newFileName`: the info file goes to its folder.
  void projectFileMoved(const ide::Ref<ide::VBProject>& project, const QString& newFileName);
  bool isIdentityModule(const ide::Ref<ide::VBComponent>& component) const;
  void componentAdded(const ide::Ref<ide::VBComponent>& component);
  void componentRemoved(const ide::Ref<ide::VBComponent>& component);
  void componentRenamed(const ide::Ref<ide::VBComponent>& component);
  /// No project is left (or the IDE closes them all): every info file is closed, and those of projects
  /// never saved are deleted.
  void closeAll();
  /// The add-in is unloaded while the projects stay open: every info file is closed and kept, since its
  /// project may still be saved.
  void detachAll();

 private:
  CProjInfo* owner(const ide::Ref<ide::VBComponent>& component) const;

  ProjInfoServices m_services;
  std::vector<std::unique_ptr<CProjInfo>> m_items;
};

}  // namespace projinfo
