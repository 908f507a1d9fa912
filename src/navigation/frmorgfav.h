// SPDX-License-Identifier: MIT
// The favourites window of a project: one row per favourite (procedure, line, module), newest first. A
// double click (or Enter) opens the favourite's code window at its line and closes the window; Delete
// removes the selected favourites.
#pragma once

#include "navigation/favorites.h"

#include <QDialog>
#include <QPoint>

class QTreeWidget;
class QTreeWidgetItem;

namespace navigation {

class frmOrgFav final : public QDialog {
  Q_OBJECT

 public:
  frmOrgFav(CFavorites& favorites, QWidget* parent = nullptr);

  QTreeWidget* lvFavorites() const { return m_lvFavorites; }
  /// Opens the favourite of `row`; closes the window when it did, or when `row` is null.
  void openRow(QTreeWidgetItem* row);

 protected:
  bool eventFilter(QObject* watched, QEvent* event) override;
  void showEvent(QShowEvent* event) override;

 private:
  void fill();
  void deleteSelected();

  CFavorites* m_favorites;
  QTreeWidget* m_lvFavorites;
  QPoint m_lastMouseDown;
};

/// Opens the favourites window modally over `parent` (or over the IDE).
void showFavorites(CFavorites& favorites, QWidget* parent = nullptr);

}  // namespace navigation
