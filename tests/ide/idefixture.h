// SPDX-License-Identifier: MIT
// What the widget tests share: an IDE on the Qt platform with its main window over a private copy of the
// example group, and small helpers to wait for the event loop.
#pragma once

#include "host/model/vbe.h"
#include "mainwindow.h"
#include "qtplatform.h"
#include "testproject.h"

#include <gtest/gtest.h>

#include <QString>
#include <QStringList>

#include <functional>
#include <memory>

class QMdiSubWindow;

namespace desktop::test {

/// Runs the event loop until `done` holds or `timeoutMs` passed; returns `done()`.
bool waitFor(const std::function<bool()>& done, int timeoutMs = 5000);
/// Lets posted work and zero-delay timers run.
void settle();

/// The IDE's model on the Qt platform, without a window.
struct DesktopVbe {
  DesktopVbe();
  std::shared_ptr<host::VbeImpl> vbe;
  QtUserInterface* ui = nullptr;
  QtEventLoop* loop = nullptr;
};

/// A main window over a copy of examples/demo, the group opened.
class IdeTest : public ::testing::Test {
 protected:
  void SetUp() override;
  void TearDown() override;

  std::shared_ptr<host::ComponentImpl> component(const QString& project, const QString& name) const;
  /// Opens a component's code window through the project explorer, as a double-click does.
  QMdiSubWindow* openCode(const QString& project, const QString& name);
  /// Shows the window and waits until it is the active window (shortcuts and focus need that).
  void activate();

  host::test::ExampleCopy m_copy;
  DesktopVbe m_ide;
  std::unique_ptr<MainWindow> m_window;
  /// Message boxes the session showed (title: text), answered from queued answers.
  QStringList m_messages;
};

}  // namespace desktop::test
