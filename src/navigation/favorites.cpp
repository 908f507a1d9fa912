// SPDX-License-Identifier: MIT
#include "navigation/favorites.h"

#include "common/errors.h"
#include "common/strings.h"
#include "navigation/texts.h"
#include "projinfo/records.h"

namespace navigation {
namespace {

QString declarations() {
  return QString::fromLatin1(kGeneralDeclarations);
}

}  // namespace

QString CFavoritesItem::Serialization() const {
  if (!Component) ide::raise(ide::err::ObjectVariableNotSet);
  return projinfo::FavoriteRecord{Component->Name(), ProcedureName, ProcKind, ItemId, Line}.toText();
}

void CFavoritesItem::setSerialization(const QString& text) {
  const auto record = projinfo::FavoriteRecord::fromText(text);
  if (!owner || !owner->Project) ide::raise(ide::err::ObjectVariableNotSet);
  Component = owner->Project->VBComponents()->Item(record.ComponentName);
  ProcedureName = record.ProcedureName;
  ProcKind = record.ProcKind;
  ItemId = record.ItemId;
  Line = record.Line;
}

CFavorites::CFavorites(projinfo::CProjInfo& owner, std::function<void(CFavorites&)> show)
    : owner(&owner), m_show(std::move(show)) {}

void CFavorites::tell(int stringId, int icon) {
  const projinfo::ProjInfoServices& services = owner->services();
  if (services.tellUser && services.vbe)
    services.vbe->Platform().ui().MsgBox(common::LoadResString(stringId), icon, common::title());
}

void CFavorites::Show() {
  if (m_show) m_show(*this);
}

void CFavorites::InitializeFromFile() {
  Project = owner->Project();
  bool failed = false;
  try {
    const projinfo::StorageElements elements = owner->favoritesStorage()->Elements();
    for (int i = 1; i <= elements.Count(); ++i) {
      try {
        auto item = std::make_shared<CFavoritesItem>();
        item->owner = this;
        item->setSerialization(owner->GetFavoritesItem(elements.Item(i).Name()));
        Favorites.Add(QLatin1StringView(projinfo::kFavoritePrefix) + QString::number(item->ItemId), item);
      } catch (const std::exception& failure) {
        common::recordErrorNumber(failure);
        failed = true;
      }
    }
  } catch (const std::exception&) {
    // What was loaded stays.
  }
  // One message for the whole file, however many records could not be read.
  if (failed) tell(kRecordFailed, ide::mb::Exclamation);
}

void CFavorites::insertRecord(const QString& key, std::shared_ptr<projinfo::InfoRecord> item) {
  auto favorite = std::dynamic_pointer_cast<CFavoritesItem>(item);
  if (!favorite) ide::raise(ide::err::InvalidProcedureCall);
  Favorites.Add(key, favorite);
}

std::shared_ptr<CFavoritesItem> CFavorites::AddFavorite(std::shared_ptr<CFavoritesItem> item) {
  item->owner = this;
  owner->AddFavoritesItem(item);
  return item;
}

void CFavorites::DeleteFavorite(qint32 ItemId) {
  owner->DeleteFavorite(ItemId);
}

void CFavorites::AddPlace(const ide::Ref<ide::VBComponent>& component, const QString& procName,
                          ide::ProcKind kind, int line) {
  try {
    if (!component) ide::raise(ide::err::ObjectVariableNotSet);
    auto module = component->CodeModule();
    if (!module) ide::raise(ide::err::ObjectVariableNotSet);
    auto item = std::make_shared<CFavoritesItem>();
    item->Component = component;
    item->ProcedureName = procName.isEmpty() ? declarations() : procName;
    if (line <= module->CountOfDeclarationLines()) {
      item->ProcedureName = declarations();
      item->Line = line;
    } else {
      item->ProcKind = static_cast<qint32>(kind);
      item->Line = line - module->ProcStartLine(item->ProcedureName, kind);
    }
    AddFavorite(item);
  } catch (const std::exception& failure) {
    common::recordErrorNumber(failure);
    tell(kAddFailed, ide::mb::Information);
  }
}

void CFavorites::Open(const CFavoritesItem& item, const std::function<void()>& hide) {
  if (!item.Component) ide::raise(ide::err::ObjectVariableNotSet);
  auto module = item.Component->CodeModule();
  if (!module) ide::raise(ide::err::ObjectVariableNotSet);
  auto pane = module->CodePane();
  if (hide) hide();
  pane->Show();
  const auto kind = static_cast<ide::ProcKind>(item.ProcKind);
  if (item.ProcedureName == declarations()) {
    const int declarationsEnd = module->CountOfDeclarationLines();
    pane->setTopLine(std::max(1, item.Line <= declarationsEnd ? item.Line : declarationsEnd));
  } else {
    int count = 0;
    try {
      count = module->ProcCountLines(item.ProcedureName, kind);
    } catch (const std::exception&) {
      ide::raise(common::kCancelled);  // the procedure was renamed or removed
    }
    const int start = module->ProcStartLine(item.ProcedureName, kind);
    pane->setTopLine(item.Line < count ? start + item.Line : start + count - 1);
  }
  // The IDE may not scroll as far as asked: the caret goes to the line it shows first.
  const int top = pane->TopLine();
  pane->SetSelection(top, 1, top, 1);
}

void CFavorites::componentRemoved(const ide::Ref<ide::VBComponent>& component) {
  for (int i = 1; i <= Favorites.Count();) {
    auto item = Favorites.Item(i);
    if (item->Component == component) {
      try {
        owner->DeleteFavorite(item->ItemId);
      } catch (const std::exception& failure) {
        common::recordErrorNumber(failure);
        Favorites.Remove(QLatin1StringView(projinfo::kFavoritePrefix) + QString::number(item->ItemId));
      }
      continue;  // the same index now holds the next item
    }
    ++i;
  }
}

void CFavorites::componentRenamed(const ide::Ref<ide::VBComponent>& component) {
  for (const auto& [key, item] : Favorites)
    if (item->Component == component) owner->WriteFavoritesItem(key, item->Serialization());
}

}  // namespace navigation
