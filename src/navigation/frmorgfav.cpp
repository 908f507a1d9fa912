// SPDX-License-Identifier: MIT
#include "navigation/frmorgfav.h"

#include "common/errors.h"
#include "common/strings.h"
#include "navigation/texts.h"

#include <QHeaderView>
#include <QKeyEvent>
#include <QTreeWidget>
#include <QVBoxLayout>

namespace navigation {
namespace {

constexpr int kKeyRole = Qt::UserRole;
constexpr int kTagRole = Qt::UserRole + 1;

ide::UserInterface& uiOf(const CFavorites& favorites) {
  return favorites.owner->services().vbe->Platform().ui();
}

}  // namespace

frmOrgFav::frmOrgFav(CFavorites& favorites, QWidget* parent)
    : QDialog(parent), m_favorites(&favorites), m_lvFavorites(new QTreeWidget(this)) {
  setObjectName(QStringLiteral("frmOrgFav"));
  m_lvFavorites->setObjectName(QStringLiteral("lvFavorites"));
  auto active = favorites.owner->services().vbe->ActiveVBProject();
  const QString project = active ? active->Name() : QString();
  setWindowTitle(common::title() + QStringLiteral(": ") + project + QStringLiteral(" - ") +
                 common::LoadResString(kFavoritesCaption));
  m_lvFavorites->setColumnCount(3);
  m_lvFavorites->setHeaderLabels({common::LoadResString(kProcedureColumn), common::LoadResString(kLineColumn),
                                  common::LoadResString(kModuleColumn)});
  m_lvFavorites->setRootIsDecorated(false);
  m_lvFavorites->setSelectionMode(QAbstractItemView::ExtendedSelection);
  m_lvFavorites->viewport()->installEventFilter(this);
  m_lvFavorites->installEventFilter(this);
  auto* layout = new QVBoxLayout(this);
  layout->addWidget(m_lvFavorites);
  resize(460, 280);
  fill();
  setFocusProxy(m_lvFavorites);
  m_lvFavorites->setFocus();
}

void frmOrgFav::showEvent(QShowEvent* event) {
  // Widths as the window was laid out in twips: 2000 and 1000, the module taking the rest.
  const double twip = logicalDpiX() / 1440.0;
  const int procedure = int(2000 * twip), line = int(1000 * twip);
  m_lvFavorites->setColumnWidth(0, procedure);
  m_lvFavorites->setColumnWidth(1, line);
  m_lvFavorites->setColumnWidth(2, std::max(0, m_lvFavorites->width() - procedure - line - 4));
  QDialog::showEvent(event);
}

void frmOrgFav::fill() {
  m_lvFavorites->clear();
  for (int i = m_favorites->Favorites.Count(); i >= 1; --i) {
    const auto item = m_favorites->Favorites.Item(i);
    auto* row = new QTreeWidgetItem(m_lvFavorites, {item->ProcedureName, QString::number(item->Line),
                                                    item->Component ? item->Component->Name() : QString()});
    row->setData(0, kKeyRole, QLatin1StringView(projinfo::kFavoritePrefix) + QString::number(item->ItemId));
    row->setData(0, kTagRole, item->ItemId);
  }
}

void frmOrgFav::openRow(QTreeWidgetItem* row) {
  if (!row) {
    accept();
    return;
  }
  bool hidden = false;
  try {
    const auto item = m_favorites->Favorites.Item(row->data(0, kKeyRole).toString());
    if (!item) ide::raise(ide::err::SubscriptOutOfRange);
    m_favorites->Open(*item, [&] {
      hidden = true;
      hide();
    });
  } catch (const std::exception& failure) {
    common::recordErrorNumber(failure);
    uiOf(*m_favorites)
        .MsgBox(
            common::LoadResString(kCannotShow) + QStringLiteral(" \n") + common::LoadResString(kMayBeGone),
            ide::mb::Information, common::title());
    if (!hidden) return;
  }
  accept();
}

void frmOrgFav::deleteSelected() {
  for (int i = 0; i < m_lvFavorites->topLevelItemCount();) {
    QTreeWidgetItem* row = m_lvFavorites->topLevelItem(i);
    if (!row->isSelected()) {
      ++i;
      continue;
    }
    try {
      m_favorites->DeleteFavorite(row->data(0, kTagRole).toInt());
    } catch (const std::exception& failure) {
      common::recordErrorNumber(failure);  // the row goes all the same
    }
    delete row;
  }
}

bool frmOrgFav::eventFilter(QObject* watched, QEvent* event) {
  if (watched == m_lvFavorites->viewport() &&
      (event->type() == QEvent::MouseButtonPress || event->type() == QEvent::MouseButtonDblClick)) {
    m_lastMouseDown = static_cast<QMouseEvent*>(event)->position().toPoint();
    // A double click below the last row closes the window too, so it is taken here and not from the rows.
    if (event->type() == QEvent::MouseButtonDblClick) {
      openRow(m_lvFavorites->itemAt(m_lastMouseDown));
      return true;
    }
  }
  if (watched == m_lvFavorites && event->type() == QEvent::KeyPress) {
    const int key = static_cast<QKeyEvent*>(event)->key();
    if (key == Qt::Key_Delete) {
      deleteSelected();
      return true;
    }
    if (key == Qt::Key_Return || key == Qt::Key_Enter) {
      if (QTreeWidgetItem* row = m_lvFavorites->currentItem()) openRow(row);
      return true;
    }
  }
  return QDialog::eventFilter(watched, event);
}

void showFavorites(CFavorites& favorites, QWidget* parent) {
  if (!parent) parent = qobject_cast<QWidget*>(uiOf(favorites).dialogParent());
  frmOrgFav dialog(favorites, parent);
  dialog.exec();
}

}  // namespace navigation
