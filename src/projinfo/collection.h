// SPDX-License-Identifier: MIT
// A keyed collection as the task list and the favourites keep their items: insertion order, lookup by a
// key that ignores letter case ("Task12", "Favorite3"), 1-based positions.
#pragma once

#include "ide/error.h"

#include <QHash>
#include <QString>

#include <memory>
#include <utility>
#include <vector>

namespace projinfo {

template <class T>
class KeyedCollection {
 public:
  /// Raises error 457 when the key is in use.
  void Add(const QString& key, std::shared_ptr<T> item) {
    const QString folded = key.toLower();
    if (m_index.contains(folded))
      ide::raise(457, QStringLiteral("This key is already associated with an element of this collection"));
    m_index.insert(folded, item);
    m_items.emplace_back(key, std::move(item));
  }
  /// False when no item has the key.
  bool Remove(const QString& key) {
    if (!m_index.remove(key.toLower())) return false;
    for (auto it = m_items.begin(); it != m_items.end(); ++it)
      if (it->first.compare(key, Qt::CaseInsensitive) == 0) {
        m_items.erase(it);
        break;
      }
    return true;
  }
  /// Null when no item has the key.
  std::shared_ptr<T> Item(const QString& key) const { return m_index.value(key.toLower()); }
  /// 1 to Count; error 9 otherwise.
  std::shared_ptr<T> Item(int index) const {
    if (index < 1 || index > Count()) ide::raise(ide::err::SubscriptOutOfRange);
    return m_items[size_t(index - 1)].second;
  }
  int Count() const { return static_cast<int>(m_items.size()); }
  void clear() {
    m_items.clear();
    m_index.clear();
  }
  /// Key and item, in insertion order.
  auto begin() const { return m_items.begin(); }
  auto end() const { return m_items.end(); }

 private:
  std::vector<std::pair<QString, std::shared_ptr<T>>> m_items;
  QHash<QString, std::shared_ptr<T>> m_index;
};

}  // namespace projinfo
