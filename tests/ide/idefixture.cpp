// SPDX-License-Identifier: MIT
#include "idefixture.h"

#include "projectexplorer.h"
#include "windowmanager.h"

#include <QApplication>
#include <QElapsedTimer>
#include <QMdiSubWindow>
#include <QTest>
#include <QThread>
#include <QTreeWidgetItem>

namespace desktop::test {

bool waitFor(const std::function<bool()>& done, int timeoutMs) {
  QElapsedTimer clock;
  clock.start();
  while (!done()) {
    if (clock.elapsed() > timeoutMs) return false;
    QCoreApplication::processEvents(QEventLoop::AllEvents, 20);
    QThread::msleep(1);
  }
  return true;
}

void settle() {
  for (int i = 0; i < 5; ++i) {
    QCoreApplication::processEvents();
    // Outside an event loop deleteLater() waits for this.
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
  }
}

DesktopVbe::DesktopVbe() {
  auto ownedUi = std::make_unique<QtUserInterface>();
  auto ownedLoop = std::make_unique<QtEventLoop>();
  ui = ownedUi.get();
  loop = ownedLoop.get();
  host::IdeOptions options;
  options.ui = std::move(ownedUi);
  options.loop = std::move(ownedLoop);
  vbe = host::VbeImpl::create(std::move(options));
}

void IdeTest::SetUp() {
  m_window = std::make_unique<MainWindow>(m_ide.vbe, *m_ide.ui);
  m_ide.ui->setMessageObserver(
      [this](const QString& title, const QString& text) { m_messages << title + u": "_qs + text; });
  m_ide.vbe->open(m_copy.groupFile());
  settle();
}

void IdeTest::TearDown() {
  m_ide.ui->setMessageObserver({});
  m_window->closeWithoutPrompt();
  m_window.reset();
  settle();
}

std::shared_ptr<host::ComponentImpl> IdeTest::component(const QString& project, const QString& name) const {
  auto p = m_ide.vbe->project(project);
  return p ? p->component(name) : nullptr;
}

QMdiSubWindow* IdeTest::openCode(const QString& project, const QString& name) {
  auto c = component(project, name);
  if (!c) return nullptr;
  if (c->hasDesigner()) {
    c->codeModule()->pane()->Show();
  } else {
    m_window->explorer().refresh();
    QTreeWidgetItem* item = m_window->explorer().itemOf(c.get());
    if (!item) return nullptr;
    Q_EMIT m_window->explorer().itemActivated(item, 0);
  }
  settle();
  return m_window->windows().subWindowOf(c->codeModule()->pane()->window().get());
}

void IdeTest::activate() {
  m_window->show();
  m_window->activateWindow();
  ASSERT_TRUE(QTest::qWaitForWindowActive(m_window.get()));
}

}  // namespace desktop::test
