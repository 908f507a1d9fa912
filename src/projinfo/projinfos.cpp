// SPDX-License-Identifier: MIT
#include "projinfo/projinfos.h"

#include <QFileInfo>

namespace projinfo {

ProjInfos::ProjInfos(ProjInfoServices services) : m_services(std::move(services)) {
  m_services.projectHolding = [this](const CProjInfo& asking, const QString& path) {
    for (const auto& info : m_items)
      if (info.get() != &asking && (info->isOpen() || info->tieLost()) &&
          QFileInfo(info->path()) == QFileInfo(path))
        return info->Project()->Name();
    return QString();
  };
}

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
    info->ProjectClosed();
    return;
  }
}

void ProjInfos::projectFileMoved(const ide::Ref<ide::VBProject>& project, const QString& newFileName) {
  if (CProjInfo* info = item(project)) info->ProjectMoved(QFileInfo(newFileName).absolutePath());
}

bool ProjInfos::isIdentityModule(const ide::Ref<ide::VBComponent>& component) const {
  for (const auto& info : m_items)
    if (info->identityModule() == component) return true;
  return false;
}

void ProjInfos::componentAdded(const ide::Ref<ide::VBComponent>& component) {
  if (CProjInfo* info = owner(component)) info->Retie(component);
}

void ProjInfos::componentRemoved(const ide::Ref<ide::VBComponent>& component) {
  CProjInfo* info = owner(component);
  if (!info) return;
  if (info->identityModule() == component) return info->TieLost();
  if (InfoRecordList* favorites = info->Favorites()) favorites->componentRemoved(component);
}

void ProjInfos::componentRenamed(const ide::Ref<ide::VBComponent>& component) {
  CProjInfo* info = owner(component);
  if (!info) return;
  if (info->Retie(component)) return;
  if (info->identityModule() == component) {
    if (info->tieLost()) return;
    if (IdentityOf(component))
      info->moduleRenamed();
    else
      info->TieLost();
    return;
  }
  if (InfoRecordList* favorites = info->Favorites()) favorites->componentRenamed(component);
}

void ProjInfos::closeAll() {
  while (!m_items.empty()) {
    std::unique_ptr<CProjInfo> info = std::move(m_items.front());
    m_items.erase(m_items.begin());
    info->ProjectClosed();
  }
}

void ProjInfos::detachAll() {
  m_items.clear();
}

}  // namespace projinfo
