// SPDX-License-Identifier: MIT
// The extended find's result list as a table model: the rows in the order found, each under the key "_"
// followed by its number ("_12"), and beside them the collection of occurrences under the same keys. Kept
// apart from the window, so that the removal rules and the navigation work without widgets.
#pragma once

#include "find/findwalk.h"

#include <QAbstractTableModel>
#include <QHash>

#include <functional>
#include <vector>

namespace find {

class FindResults final : public QAbstractTableModel {
  Q_OBJECT

 public:
  /// Project, module, procedure, found text.
  static constexpr int kColumns = 4;

  explicit FindResults(QObject* parent = nullptr) : QAbstractTableModel(parent) {}

  int rowCount(const QModelIndex& parent = {}) const override;
  int columnCount(const QModelIndex& parent = {}) const override;
  QVariant data(const QModelIndex& index, int role = Qt::DisplayRole) const override;
  QVariant headerData(int section, Qt::Orientation orientation, int role = Qt::DisplayRole) const override;

  /// Appends the row numbered after the last one added since the list was emptied; returns its key.
  QString add(FoundRow row);
  /// Empties the list and the collection; numbering starts again at 1.
  void clear();

  /// The row's key, or an empty text outside the list.
  QString keyOf(int row) const;
  /// The occurrence stored under `key`, or null.
  const CItemFound* item(const QString& key) const;
  const FoundRow& row(int row) const { return m_rows[size_t(row)].row; }

  /// Removes every row of the module `name` of `project` (column 2, trimmed, and the project searched),
  /// from the list and from the collection: a module of that name in another project keeps its rows.
  /// Returns the number removed.
  int RemoveItemsOfComponent(const QString& name, const ide::Ref<ide::VBProject>& project);
  /// Removes every row whose project (column 1), trimmed, is `name`. Returns the number removed.
  int RemoveItemsOfProject(const QString& name);

 private:
  struct Entry {
    QString key;
    FoundRow row;
  };
  int removeWhere(const std::function<bool(const FoundRow&)>& matches);

  std::vector<Entry> m_rows;
  QHash<QString, CItemFound> m_items;
  int m_lastNumber = 0;
};

}  // namespace find
