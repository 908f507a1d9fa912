// SPDX-License-Identifier: MIT
// Script mode: a line-based script drives a whole IDE session without a person (see SCRIPTING.md). The
// steps run one at a time from the event loop, so that a step may open a modal dialog and the following
// steps keep running inside that dialog's loop, finding it as the active modal widget. Every message box
// of the session is printed to standard output; a failing step ends the session with its script line.
#pragma once

#include <QObject>
#include <QString>
#include <QStringList>
#include <QTimer>

#include <functional>
#include <optional>
#include <vector>

class QWidget;

namespace desktop {

class MainWindow;
class QtUserInterface;

struct ScriptStep {
  int line = 0;
  QString command;
  QStringList arguments;
};

class ScriptRunner final : public QObject {
  Q_OBJECT

 public:
  ScriptRunner(MainWindow& window, QtUserInterface& ui);
  ~ScriptRunner() override;

  /// Reads and checks a script; on a mistake returns false and sets `error` to "<file>:<line>: <what>".
  bool load(const QString& path, QString* error);
  bool parse(const QString& text, const QString& name, QString* error);
  const std::vector<ScriptStep>& steps() const { return m_steps; }
  /// Runs the steps from the event loop; finished() tells the exit code.
  void start();
  /// Milliseconds a step waits for a dialog or widget to appear before it fails.
  void setPatience(int ms) { m_patienceMs = ms; }
  /// Whether the end of the script also ends the application's event loops (the program), or only tells
  /// finished() (a test that runs scripts in its own process).
  void setExitOnFinish(bool exit) { m_exitOnFinish = exit; }
  /// Why the script failed ("<file>:<line>: <what>"), empty while it has not.
  const QString& error() const { return m_error; }
  bool isFinished() const { return m_finished; }
  /// While the IDE starts (its add-ins too), the steps wait, except for a dialog or message box that the
  /// start-up opens: that one is theirs to deal with.
  void setStarting(bool starting) { m_starting = starting; }

 Q_SIGNALS:
  void finished(int exitCode);

 protected:
  bool eventFilter(QObject* watched, QEvent* event) override;

 private:
  void schedule(int delayMs);
  void tick();
  /// Runs a step; what keeps it from running yet (its dialog or widget has not appeared) comes back, to be
  /// tried again on the next tick.
  std::optional<QString> execute(const ScriptStep& step);
  /// Said by a step's handler that cannot run yet, and why.
  void notYet(QString why) { m_notReady = std::move(why); }
  void finish(int exitCode, const QString& error = {});
  void noteMessage(const QString& title, const QString& text);
  bool answerOpenMessageBox();
  QWidget* findWidget(const QString& name) const;
  /// The script's commands, each with its handler (scriptrunner.cpp).
  struct Commands;
  std::vector<QWidget*> dialogs() const;

  MainWindow& m_window;
  QtUserInterface& m_ui;
  QString m_name;
  QString m_directory;
  std::vector<ScriptStep> m_steps;
  size_t m_next = 0;
  bool m_finished = false;
  bool m_starting = false;
  int m_patienceMs = 10000;
  qint64 m_waitingSince = -1;
  std::optional<QString> m_notReady;
  QString m_lastMessage;
  QString m_error;
  std::function<void(const QString&, const QString&)> m_previousObserver;
  QTimer m_closer;
  bool m_exitOnFinish = true;
};

}  // namespace desktop
