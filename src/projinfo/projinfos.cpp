// SPDX-License-Identifier: MIT
#include "projinfo/projinfos.h"

#include <QFile>
#include <QFileInfo>

namespace projinfo {

ProjInfos::~ProjInfos() {
  closeAll();
}

CProjInfo* ProjInfos::item(const ide::Ref<ide::VBProject>& project) const {
  for (const auto& info : m_items)
    if (info->Project() == project) return info.get();
  return nullptr;
}

CProjInfo* ProjInfos::owner(const ide::Ref<ide::VBComponent>& component) const {
  try {
    return item(component->Collection()->Parent());
  } catch (const std::exception&) {
    return nullptr;  // a component that left its project already
  }
}

void ProjInfos::projectAdded(const ide::Ref<ide::VBProject>& project) {
  if (item(project)) return;
  m_items.push_back(std::make_unique<CProjInfo>(m_services));
  CProjInfo& info = *m_items.back();
  info.setProject(project);
  info.Initialize();
}

void ProjInfos::projectRemoved(const ide::Ref<ide::VBProject>& project) {
  for (auto it = m_items.begin(); it != m_items.end(); ++it) {
    if ((*it)->Project() != project) continue;
    std::unique_ptr<CProjInfo> info = std::move(*it);
    m_items.erase(it);
    const bool neverSaved = project->FileName().isEmpty() && info->isOpen();
    const QString path = info->path();
    info->CloseFile();
    if (neverSaved) QFile::remove(path);
    return;
  }
}

void ProjInfos::projectFileMoved(const ide::Ref<ide::VBProject>& project, const QString& newFileName) {
  if (CProjInfo* info = item(project)) info->ProjectMoved(QFileInfo(newFileName).absolutePath());
}

bool ProjInfos::isIdentityModule(const ide::Ref<ide::VBComponent>& component) const {
  for (const auto& info : m_items)
    if (info->basProjInfo == component) return true;
  return false;
}

void ProjInfos::componentRemoved(const ide::Ref<ide::VBComponent>& component) {
  CProjInfo* info = owner(component);
  if (!info) return;
  if (info->basProjInfo == component) return info->TieLost();
  if (InfoRecordList* favorites = info->Favorites()) favorites->componentRemoved(component);
}

void ProjInfos::componentRenamed(const ide::Ref<ide::VBComponent>& component) {
  CProjInfo* info = owner(component);
  if (!info) return;
  if (info->basProjInfo == component) {
    if (!IdentityOf(component)) info->TieLost();
    return;
  }
  if (InfoRecordList* favorites = info->Favorites()) favorites->componentRenamed(component);
}

void ProjInfos::closeAll() {
  while (!m_items.empty()) {
    std::unique_ptr<CProjInfo> info = std::move(m_items.front());
    m_items.erase(m_items.begin());
    const bool neverSaved = info->Project()->FileName().isEmpty() && info->isOpen();
    const QString path = info->path();
    info->CloseFile();
    if (neverSaved) QFile::remove(path);
  }
}

}  // namespace projinfo
