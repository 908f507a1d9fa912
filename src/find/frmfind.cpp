// SPDX-License-Identifier: MIT
#include "find/frmfind.h"

#include "common/errors.h"
#include "common/strings.h"
#include "find/navigate.h"
#include "find/texts.h"

#include <QApplication>
#include <QCheckBox>
#include <QCloseEvent>
#include <QGridLayout>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QHeaderView>
#include <QLabel>
#include <QLineEdit>
#include <QMouseEvent>
#include <QPointer>
#include <QPushButton>
#include <QRadioButton>
#include <QStatusBar>
#include <QTreeView>
#include <QVBoxLayout>

namespace find {

struct frmFind::Run {
  explicit Run(ide::EventLoop& loop) : context(QStringLiteral("frmFind"), &loop, nullptr) {
    // The IDE's loop decides how often it runs: every yield is offered to it.
    context.setYieldInterval({});
  }
  walk::WalkContext context;
  /// The window was destroyed: the search must not touch it again.
  bool windowGone = false;
  /// "&Fechar" was pressed during the search: the window was emptied and hidden.
  bool closed = false;
};

void SetTopMost(QWidget& window, bool topmost) {
  const bool shown = window.isVisible();
  window.setWindowFlag(Qt::WindowStaysOnTopHint, topmost);
  // Changing a window's flags hides it.
  if (shown) window.show();
}

frmFind::frmFind(ide::Ref<ide::VBE> vbe, QWidget* parent)
    : QWidget(parent, Qt::Window),
      m_vbe(std::move(vbe)),
      m_txtSearch(new QLineEdit(this)),
      m_ckWholeWd(new QCheckBox(common::LoadResString(kWholeWords), this)),
      m_ckMatchCase(new QCheckBox(common::LoadResString(kMatchCase), this)),
      m_ckPattern(new QCheckBox(common::LoadResString(kUsePattern), this)),
      m_cmdCancel(new QPushButton(common::LoadResString(kStopSearch), this)),
      m_cmdFind(new QPushButton(common::LoadResString(kFindButton), this)),
      m_cmdClose(new QPushButton(common::LoadResString(kFindClose), this)),
      m_lblResults(new QLabel(common::LoadResString(kResults), this)),
      m_lvList(new QTreeView(this)),
      m_sbStatus(new QStatusBar(this)),
      m_statusPanel(new QLabel(m_sbStatus)),
      m_results(new FindResults(this)),
      m_run(std::make_shared<Run>(m_vbe->Platform().loop())) {
  setObjectName(QStringLiteral("frmFind"));
  setWindowTitle(common::title() + QStringLiteral(" - ") + common::LoadResString(kFindCaption));
  m_txtSearch->setObjectName(QStringLiteral("txtSearch"));
  m_ckWholeWd->setObjectName(QStringLiteral("ckWholeWd"));
  m_ckMatchCase->setObjectName(QStringLiteral("ckMatchCase"));
  m_ckPattern->setObjectName(QStringLiteral("ckPattern"));
  m_cmdCancel->setObjectName(QStringLiteral("cmdCancel"));
  m_cmdFind->setObjectName(QStringLiteral("cmdFind"));
  m_cmdClose->setObjectName(QStringLiteral("cmdClose"));
  m_lblResults->setObjectName(QStringLiteral("lblResults"));
  m_lvList->setObjectName(QStringLiteral("lvList"));
  m_sbStatus->setObjectName(QStringLiteral("sbStatus"));

  auto* where = new QGroupBox(common::LoadResString(kFindWhereFrame), this);
  auto* options = new QVBoxLayout(where);
  for (int i = 0; i < 3; ++i) {
    m_opSearch[size_t(i)] = new QRadioButton(common::LoadResString(kFindScopeFirst + i), where);
    m_opSearch[size_t(i)]->setObjectName(QStringLiteral("OpSearch%1").arg(i + 1));
    options->addWidget(m_opSearch[size_t(i)]);
  }
  m_opSearch[0]->setChecked(true);
  auto* searchLabel = new QLabel(common::LoadResString(kFindTextLabel), this);
  searchLabel->setBuddy(m_txtSearch);

  auto* left = new QVBoxLayout;
  left->addWidget(searchLabel);
  left->addWidget(m_txtSearch);
  left->addWidget(m_ckWholeWd);
  left->addWidget(m_ckMatchCase);
  left->addWidget(m_ckPattern);
  left->addStretch();
  auto* buttons = new QVBoxLayout;
  for (QPushButton* button : {m_cmdFind, m_cmdCancel, m_cmdClose}) {
    button->setAutoDefault(false);
    buttons->addWidget(button);
  }
  buttons->addStretch();
  m_cmdFind->setDefault(true);
  m_cmdCancel->setEnabled(false);
  auto* top = new QHBoxLayout;
  top->addLayout(left, 1);
  top->addWidget(where);
  top->addLayout(buttons);

  m_lvList->setModel(m_results);
  m_lvList->setRootIsDecorated(false);
  m_lvList->setUniformRowHeights(true);
  m_lvList->setAlternatingRowColors(true);
  m_lvList->setSelectionBehavior(QAbstractItemView::SelectRows);
  m_lvList->setSelectionMode(QAbstractItemView::SingleSelection);
  m_lvList->setEditTriggers(QAbstractItemView::NoEditTriggers);
  m_lvList->setAllColumnsShowFocus(true);
  m_lvList->header()->setStretchLastSection(true);
  m_lvList->setColumnWidth(0, 100);
  m_lvList->setColumnWidth(1, 120);
  m_lvList->setColumnWidth(2, 140);
  m_lvList->viewport()->installEventFilter(this);
  m_sbStatus->setSizeGripEnabled(false);
  m_sbStatus->addWidget(m_statusPanel, 1);

  auto* layout = new QVBoxLayout(this);
  layout->addLayout(top);
  layout->addWidget(m_lblResults);
  layout->addWidget(m_lvList, 1);
  layout->addWidget(m_sbStatus);
  resize(880, 480);
  SetTopMost(*this, true);

  connect(m_cmdFind, &QPushButton::clicked, this, &frmFind::cmdFind_Click);
  connect(m_cmdCancel, &QPushButton::clicked, this, &frmFind::cmdCancel_Click);
  connect(m_cmdClose, &QPushButton::clicked, this, &frmFind::cmdClose_Click);
  connect(m_ckPattern, &QCheckBox::toggled, this, &frmFind::ckPattern_Click);
  connect(m_lvList, &QTreeView::doubleClicked, this, &frmFind::lvList_DblClick);
}

frmFind::~frmFind() {
  // A search yielding to the loop that destroyed the window ends at its next check, without the window.
  m_run->windowGone = true;
  m_run->context.Cancel();
}

void frmFind::Show(const QString& searchText) {
  if (!searchText.isEmpty() && !searchText.contains(u'\r') && !searchText.contains(u'\n'))
    m_txtSearch->setText(searchText);
  setWindowState(windowState() & ~Qt::WindowMinimized);
  show();
  raise();
  activateWindow();
  m_txtSearch->setFocus();
  m_txtSearch->selectAll();
}

QString frmFind::statusText() const {
  return m_statusPanel->text();
}

bool frmFind::cancelled() const {
  return m_run->context.cancelled();
}

SearchScope frmFind::scope() const {
  if (m_opSearch[1]->isChecked()) return SearchScope::ActiveProject;
  if (m_opSearch[2]->isChecked()) return SearchScope::ActiveModule;
  return SearchScope::AllProjects;
}

void frmFind::cmdFind_Click() {
  if (m_searching) return;
  // Wildcard matching ignores letter case, and Find refuses match case together with it: the greyed box
  // must not turn every wildcard search into a failure.
  const FindOptions options{m_txtSearch->text(), m_ckWholeWd->isChecked(),
                            m_ckMatchCase->isChecked() && !m_ckPattern->isChecked(),
                            m_ckPattern->isChecked()};
  if (options.text.isEmpty()) return;
  // Held here: the window may be destroyed while the search yields.
  const std::shared_ptr<Run> run = m_run;
  const ide::Ref<ide::VBE> vbe = m_vbe;
  m_searching = true;
  run->closed = false;
  m_results->clear();
  m_cmdCancel->setEnabled(true);
  m_cmdFind->setEnabled(false);
  status(common::LoadResString(kSearching));
  vbe->Platform().loop().DoEvents();
  if (run->windowGone) return;
  run->context.reset();

  FindWalk walk(run->context, *vbe, *this);
  try {
    walk.Search(scope(), options);
  } catch (const std::exception& failure) {
    if (run->windowGone) return;
    const ide::Error error =
        common::recordError(failure, QStringLiteral("frmFind"), QStringLiteral("cmdFind_Click"), 0);
    common::logLastError();
    // The fixed message, and below it what failed (an invalid pattern ...), so that the user can act on it.
    vbe->Platform().ui().MsgBox(common::LoadResString(kSearchFailed) + u'\n' +
                                    QString::number(error.number()) + u' ' + error.description(),
                                ide::mb::Exclamation, common::title());
  }
  if (run->windowGone) return;
  m_cmdCancel->setEnabled(false);
  m_cmdFind->setEnabled(true);
  if (!run->closed)
    status(common::LoadResString(kCompleted) + u' ' + QString::number(m_results->rowCount()) + u' ' +
           common::LoadResString(kLinesFound));
  m_searching = false;
}

void frmFind::cmdCancel_Click() {
  m_run->context.Cancel();
}

void frmFind::cmdClose_Click() {
  m_run->context.Cancel();
  if (m_searching) m_run->closed = true;
  QPointer<frmFind> self(this);
  m_vbe->Platform().loop().DoEvents();
  if (!self) return;
  m_txtSearch->clear();
  m_results->clear();
  m_lblResults->setText(common::LoadResString(kResults));
  status(QString());
  m_cmdFind->setEnabled(true);
  m_cmdCancel->setEnabled(false);
  hide();
}

void frmFind::ckPattern_Click() {
  m_ckMatchCase->setEnabled(!m_ckPattern->isChecked());
}

void frmFind::lvList_DblClick() {
  if (m_searching) return;
  const QModelIndex index = m_lvList->indexAt(m_mouse);
  if (!index.isValid()) return;
  const CItemFound* item = m_results->item(m_results->keyOf(index.row()));
  if (!item) return;
  const CItemFound occurrence = *item;  // the list may change while the code window opens
  QPointer<frmFind> self(this);
  try {
    ShowItemFound(*m_vbe, occurrence, [self] {
      if (self) self->showMinimized();
    });
  } catch (const std::exception& failure) {
    common::recordError(failure, QStringLiteral("frmFind"), QStringLiteral("lvList_DblClick"), 0);
    common::ShowErrorReport(m_vbe->Platform().ui());
  }
}

void frmFind::closeEvent(QCloseEvent* event) {
  event->ignore();
  cmdClose_Click();
}

void frmFind::changeEvent(QEvent* event) {
  QWidget::changeEvent(event);
  if (event->type() != QEvent::ActivationChange || isActiveWindow() || !isVisible() || isMinimized()) return;
  // Acted on once the activation has settled, from the IDE's loop.
  QPointer<frmFind> self(this);
  m_vbe->Platform().loop().post([self] {
    if (self) self->deactivated();
  });
}

void frmFind::deactivated() {
  if (!isVisible() || isMinimized() || isActiveWindow()) return;
  // A message box about the window's own search takes the activation too: the window stays behind it.
  if (QApplication::activeModalWidget()) return;
  showMinimized();
}

bool frmFind::eventFilter(QObject* watched, QEvent* event) {
  if (watched == m_lvList->viewport() && event->type() == QEvent::MouseButtonPress)
    m_mouse = static_cast<QMouseEvent*>(event)->position().toPoint();
  return QWidget::eventFilter(watched, event);
}

void frmFind::status(const QString& text) {
  m_statusPanel->setText(text);
}

void frmFind::resultsLabel(const QString& text) {
  m_lblResults->setText(text);
}

void frmFind::found(FoundRow row) {
  m_results->add(std::move(row));
}

}  // namespace find
