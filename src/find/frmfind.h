// SPDX-License-Identifier: MIT
// The extended find window: searches all projects, the active project or the selected module for a text
// (whole words, match case, wildcards) and lists every occurrence as the search goes. A double-click on a
// row opens the code window at the occurrence. The window stays above the IDE, gets out of the way
// (minimised) when the programmer goes back to the IDE, and "&Fechar" only hides it, with its options kept.
#pragma once

#include "find/findresults.h"
#include "find/findwalk.h"
#include "ide/vbide.h"

#include <QPoint>
#include <QWidget>

#include <array>
#include <memory>

class QCheckBox;
class QLabel;
class QLineEdit;
class QPushButton;
class QRadioButton;
class QStatusBar;
class QTreeView;

namespace find {

/// Keeps `window` above every other window (or lets it go back among them), where it stands.
void SetTopMost(QWidget& window, bool topmost);

/// Idle → searching ("&Localizar": rows are added as they are found, "Parar Pe&squisa" enabled,
/// double-clicks ignored) → idle at the end, on a cancel or on a failure, which shows its message and keeps
/// the rows found. Message boxes go through the IDE's user interface.
class frmFind final : public QWidget, private FindReport {
  Q_OBJECT

 public:
  explicit frmFind(ide::Ref<ide::VBE> vbe, QWidget* parent = nullptr);
  ~frmFind() override;

  /// Shows the window restored and in front; a one-line `searchText` (the code window's selection)
  /// replaces the search text.
  void Show(const QString& searchText = {});

  // The window's controls, by their names. OpSearch takes 1 (all projects) to 3 (the selected module).
  QRadioButton* OpSearch(int index) const { return m_opSearch.at(size_t(index - 1)); }
  QLineEdit* txtSearch() const { return m_txtSearch; }
  QCheckBox* ckWholeWd() const { return m_ckWholeWd; }
  QCheckBox* ckMatchCase() const { return m_ckMatchCase; }
  QCheckBox* ckPattern() const { return m_ckPattern; }
  QPushButton* cmdCancel() const { return m_cmdCancel; }
  QPushButton* cmdFind() const { return m_cmdFind; }
  QPushButton* cmdClose() const { return m_cmdClose; }
  QLabel* lblResults() const { return m_lblResults; }
  QTreeView* lvList() const { return m_lvList; }
  QStatusBar* sbStatus() const { return m_sbStatus; }
  /// The status bar's first panel.
  QString statusText() const;
  FindResults& results() const { return *m_results; }

  bool searching() const { return m_searching; }
  bool cancelled() const;

  /// A module or project left the IDE: its rows go.
  void RemoveItemsOfComponent(const QString& name, const ide::Ref<ide::VBProject>& project) {
    m_results->RemoveItemsOfComponent(name, project);
  }
  void RemoveItemsOfProject(const QString& name) { m_results->RemoveItemsOfProject(name); }

 protected:
  /// The window's close box does what "&Fechar" does.
  void closeEvent(QCloseEvent* event) override;
  void changeEvent(QEvent* event) override;
  bool eventFilter(QObject* watched, QEvent* event) override;

 private:
  /// What a search shares with the window, which may be destroyed while the search yields.
  struct Run;

  void cmdFind_Click();
  void cmdCancel_Click();
  void cmdClose_Click();
  void ckPattern_Click();
  void lvList_DblClick();
  /// Runs once the activation has moved on: a window left in the background minimises itself.
  void deactivated();
  SearchScope scope() const;

  void status(const QString& text) override;
  void resultsLabel(const QString& text) override;
  void found(FoundRow row) override;

  ide::Ref<ide::VBE> m_vbe;
  std::array<QRadioButton*, 3> m_opSearch{};
  QLineEdit* m_txtSearch;
  QCheckBox* m_ckWholeWd;
  QCheckBox* m_ckMatchCase;
  QCheckBox* m_ckPattern;
  QPushButton* m_cmdCancel;
  QPushButton* m_cmdFind;
  QPushButton* m_cmdClose;
  QLabel* m_lblResults;
  QTreeView* m_lvList;
  QStatusBar* m_sbStatus;
  QLabel* m_statusPanel;
  FindResults* m_results;

  std::shared_ptr<Run> m_run;
  bool m_searching = false;
  QPoint m_mouse{-1, -1};
};

}  // namespace find
