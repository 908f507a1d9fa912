// SPDX-License-Identifier: MIT
#include "find/findresults.h"

#include "common/strings.h"
#include "find/texts.h"
#include "syntax/text.h"

namespace find {

int FindResults::rowCount(const QModelIndex& parent) const {
  return parent.isValid() ? 0 : static_cast<int>(m_rows.size());
}

int FindResults::columnCount(const QModelIndex& parent) const {
  return parent.isValid() ? 0 : kColumns;
}

QVariant FindResults::data(const QModelIndex& index, int role) const {
  if (!index.isValid() || index.row() >= rowCount() || (role != Qt::DisplayRole && role != Qt::ToolTipRole))
    return {};
  const FoundRow& found = m_rows[size_t(index.row())].row;
  switch (index.column()) {
    case 0:
      return found.project;
    case 1:
      return found.module;
    case 2:
      return found.procedure;
    case 3:
      return found.text;
    default:
      return {};
  }
}

QVariant FindResults::headerData(int section, Qt::Orientation orientation, int role) const {
  if (orientation != Qt::Horizontal || role != Qt::DisplayRole || section < 0 || section >= kColumns)
    return {};
  return common::LoadResString(kFirstCaption + section);
}

QString FindResults::add(FoundRow row) {
  QString key = u'_' + QString::number(++m_lastNumber);
  const int at = rowCount();
  beginInsertRows({}, at, at);
  m_items.insert(key, row.item);
  m_rows.push_back(Entry{key, std::move(row)});
  endInsertRows();
  return key;
}

void FindResults::clear() {
  beginResetModel();
  m_rows.clear();
  m_items.clear();
  m_lastNumber = 0;
  endResetModel();
}

QString FindResults::keyOf(int row) const {
  return row >= 0 && row < rowCount() ? m_rows[size_t(row)].key : QString();
}

const CItemFound* FindResults::item(const QString& key) const {
  const auto found = m_items.constFind(key);
  return found == m_items.constEnd() ? nullptr : &found.value();
}

int FindResults::RemoveItemsOfComponent(const QString& name, const ide::Ref<ide::VBProject>& project) {
  return removeWhere([&](const FoundRow& row) {
    return row.item.Project == project && syntax::trimmedView(row.module) == name;
  });
}

int FindResults::RemoveItemsOfProject(const QString& name) {
  return removeWhere([&](const FoundRow& row) { return syntax::trimmedView(row.project) == name; });
}

int FindResults::removeWhere(const std::function<bool(const FoundRow&)>& rowMatches) {
  const auto matches = [&](size_t i) { return rowMatches(m_rows[i].row); };
  int removed = 0;
  // The rows of one module lie together: each run of them goes at once.
  for (size_t i = 0; i < m_rows.size();) {
    if (!matches(i)) {
      ++i;
      continue;
    }
    size_t end = i + 1;
    while (end < m_rows.size() && matches(end))
      ++end;
    beginRemoveRows({}, int(i), int(end - 1));
    for (size_t k = i; k < end; ++k)
      m_items.remove(m_rows[k].key);
    m_rows.erase(m_rows.begin() + std::ptrdiff_t(i), m_rows.begin() + std::ptrdiff_t(end));
    endRemoveRows();
    removed += int(end - i);
  }
  return removed;
}

}  // namespace find
