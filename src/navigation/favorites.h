// SPDX-License-Identifier: MIT
// Favourites: code places kept per project (a component, the procedure or the declarations section, and
// a line), one record each in the project's info file, so that they survive closing and reopening the
// project. CFavorites is owned by the project's CProjInfo while its info file is open; frmOrgFav lists
// them and jumps to them.
#pragma once

#include "ide/vbide.h"
#include "projinfo/collection.h"
#include "projinfo/projinfo.h"

#include <QString>

#include <functional>
#include <memory>

namespace navigation {

/// The procedure name of a favourite in a module's declarations section.
inline constexpr char kGeneralDeclarations[] = "General Declarations";

class CFavorites;

class CFavoritesItem final : public projinfo::InfoRecord {
 public:
  /// The list the item belongs to; set when it is loaded or added.
  CFavorites* owner = nullptr;
  ide::Ref<ide::VBComponent> Component;
  /// The procedure, or kGeneralDeclarations.
  QString ProcedureName;
  /// The kind the procedure was asked for with: 0 also for the declarations; 1 Let, 2 Set, 3 Get.
  qint32 ProcKind = 0;
  /// In the declarations: the line in the module. In a procedure: the offset from the procedure's start
  /// line (as the IDE counts it, comments above the header included).
  qint32 Line = 0;

  /// The record text, with the component's current name. Raises when the item has no component.
  QString Serialization() const override;
  /// Fills the item from a record text, finding the component by name in the owner's project. Raises
  /// when the record cannot be read or names a component the project does not have.
  void setSerialization(const QString& text);
};

class CFavorites final : public projinfo::InfoRecordList {
 public:
  /// `show` opens the organise window; `owner` outlives the list.
  CFavorites(projinfo::CProjInfo& owner, std::function<void(CFavorites&)> show);

  projinfo::CProjInfo* owner;
  ide::Ref<ide::VBProject> Project;
  /// Keyed "Favorite" + identifier, in the order they were loaded or added.
  projinfo::KeyedCollection<CFavoritesItem> Favorites;

  /// Opens the organise window (modal).
  void Show();
  void DeleteFavorite(qint32 ItemId);
  /// Loads every record; those that cannot be read are left out (and in the file), and the user is told
  /// once.
  void InitializeFromFile() override;
  /// Stores a new favourite, giving it its identifier.
  std::shared_ptr<CFavoritesItem> AddFavorite(std::shared_ptr<CFavoritesItem> item);

  /// The add command: a favourite for line `line` of `component`'s code, in the procedure `procName` of
  /// kind `kind` (empty or kGeneralDeclarations outside any procedure). Tells the user when it fails.
  void AddPlace(const ide::Ref<ide::VBComponent>& component, const QString& procName, ide::ProcKind kind,
                int line);
  /// Brings the favourite's code pane to the front at its line. `hide` is called just before the pane is
  /// shown. Raises when the favourite cannot be shown (error 9999 when its procedure is gone).
  void Open(const CFavoritesItem& item, const std::function<void()>& hide);

  void insertRecord(const QString& key, std::shared_ptr<projinfo::InfoRecord> item) override;
  void removeRecord(const QString& key) override { Favorites.Remove(key); }
  /// Deletes the favourites of a removed component from the file.
  void componentRemoved(const ide::Ref<ide::VBComponent>& component) override;
  /// Writes the favourites of a renamed component again, with its new name.
  void componentRenamed(const ide::Ref<ide::VBComponent>& component) override;

 private:
  void tell(int stringId, int icon);

  std::function<void(CFavorites&)> m_show;
};

}  // namespace navigation
