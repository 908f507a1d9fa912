// SPDX-License-Identifier: MIT
// The IDE's platform services on Qt: a message loop whose timers and posted work run on the Qt event loop,
// and a user interface that shows message boxes over the main window. Scripts queue the answers of the
// next message boxes and watch every box the session shows.
#pragma once

#include "ide/platform.h"

#include <QElapsedTimer>
#include <QLoggingCategory>
#include <QObject>
#include <QPointer>
#include <QString>

#include <deque>
#include <functional>
#include <map>
#include <memory>

class QSplashScreen;
class QTimer;
class QWidget;

namespace desktop {

/// The desktop IDE's log ("quimbel.ide"): failures it goes on after. Debug messages, for failures that are
/// part of normal use, show with QT_LOGGING_RULES="quimbel.ide.debug=true".
Q_DECLARE_LOGGING_CATEGORY(lcIde)

class QtEventLoop final : public ide::EventLoop {
 public:
  QtEventLoop();
  ~QtEventLoop() override;

  int SetTimer(int intervalMs, std::function<void()> callback) override;
  bool KillTimer(int timerId) override;
  void post(std::function<void()> work) override;
  /// Runs pending events, timers and input, but at most once per kYieldIntervalMs: a walk that yields on
  /// every line then costs little more than the check of the clock.
  void DoEvents() override;
  qint64 tickCount() override { return m_clock.elapsed(); }

  int activeTimers() const { return static_cast<int>(m_timers.size()); }
  static constexpr qint64 kYieldIntervalMs = 8;

 private:
  // Owns the timers and receives the posted work, so that nothing runs after the loop is gone.
  QObject m_context;
  std::map<int, QPointer<QTimer>> m_timers;
  int m_nextId = 1;
  QElapsedTimer m_clock;
  qint64 m_lastYield = -kYieldIntervalMs;
};

class QtUserInterface final : public ide::UserInterface {
 public:
  QtUserInterface();
  ~QtUserInterface() override;

  int MsgBox(const QString& prompt, int style, const QString& title) override;
  ide::Cursor setCursor(ide::Cursor cursor) override;
  void showSplash(const QString& text) override;
  bool openDocument(const QString& path) override;
  QObject* dialogParent() override;

  void setDialogParent(QWidget* parent);
  QWidget* dialogParentWidget() const { return m_parent; }

  /// The answer the next message box gets without being shown (script mode).
  void queueAnswer(int answer) { m_answers.push_back(answer); }
  bool hasQueuedAnswer() const { return !m_answers.empty(); }
  int takeQueuedAnswer();
  /// Told of every message box, shown or answered from the queue.
  void setMessageObserver(std::function<void(const QString& title, const QString& text)> observer) {
    m_observer = std::move(observer);
  }
  const std::function<void(const QString&, const QString&)>& messageObserver() const { return m_observer; }
  /// Documents are only noted, not opened, when the session runs a script.
  void setOpenDocuments(bool open) { m_openDocuments = open; }

  /// The property that marks the message boxes this class shows (a script's watcher skips them).
  static constexpr const char* kOwnBoxProperty = "quimbelMsgBox";

 private:
  QPointer<QWidget> m_parent;
  std::deque<int> m_answers;
  std::function<void(const QString&, const QString&)> m_observer;
  ide::Cursor m_cursor = ide::Cursor::Default;
  std::unique_ptr<QSplashScreen> m_splash;
  bool m_openDocuments = true;
};

}  // namespace desktop
