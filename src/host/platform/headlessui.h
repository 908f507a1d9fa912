// SPDX-License-Identifier: MIT
// User-interface services of the IDE when it runs without a display (tests, scripts, the command-line
// tool): message boxes are recorded and answered from a queue of answers, or by the box's default button.
#pragma once

#include "ide/platform.h"

#include <QString>

#include <deque>
#include <functional>
#include <vector>

namespace host {

class HeadlessUi final : public ide::UserInterface {
 public:
  struct MessageBox {
    QString prompt;
    int style = 0;
    QString title;
    int answer = 0;
  };

  int MsgBox(const QString& prompt, int style, const QString& title) override;
  ide::Cursor setCursor(ide::Cursor cursor) override;
  void showSplash(const QString& text) override;
  bool openDocument(const QString& path) override;
  QObject* dialogParent() override { return nullptr; }

  /// The answer to give the next message box (boxes without a queued answer get their default button).
  void queueAnswer(int answer) { m_answers.push_back(answer); }
  /// Called for every message box before the queue is consulted; a non-zero result is the answer.
  void setAnswerer(std::function<int(const MessageBox&)> answerer) { m_answerer = std::move(answerer); }
  const std::vector<MessageBox>& messageBoxes() const { return m_boxes; }
  void clearMessageBoxes() { m_boxes.clear(); }

  ide::Cursor cursor() const { return m_cursor; }
  const QString& splashText() const { return m_splash; }
  /// Every splash text shown, in order (an empty entry is a close).
  const std::vector<QString>& splashHistory() const { return m_splashHistory; }
  const std::vector<QString>& openedDocuments() const { return m_documents; }
  void setCanOpenDocuments(bool can) { m_canOpenDocuments = can; }

  /// The answer a box gets from its default button.
  static int defaultAnswer(int style);

 private:
  std::deque<int> m_answers;
  std::function<int(const MessageBox&)> m_answerer;
  std::vector<MessageBox> m_boxes;
  ide::Cursor m_cursor = ide::Cursor::Default;
  QString m_splash;
  std::vector<QString> m_splashHistory;
  std::vector<QString> m_documents;
  bool m_canOpenDocuments = false;
};

}  // namespace host
