// SPDX-License-Identifier: MIT
#include "host/platform/headlessui.h"

namespace host {

int HeadlessUi::defaultAnswer(int style) {
  const bool second = (style & ide::mb::DefaultButton2) != 0;
  switch (ide::mb::buttonsOf(style)) {
    case ide::mb::OKCancel:
      return second ? ide::mb::Cancel : ide::mb::OK;
    case ide::mb::AbortRetryIgnore:
      return second ? ide::mb::Retry : ide::mb::Abort;
    case ide::mb::YesNoCancel:
      return second ? ide::mb::No : ide::mb::Yes;
    case ide::mb::YesNo:
      return second ? ide::mb::No : ide::mb::Yes;
    case ide::mb::RetryCancel:
      return second ? ide::mb::Cancel : ide::mb::Retry;
    default:
      return ide::mb::OK;
  }
}

int HeadlessUi::MsgBox(const QString& prompt, int style, const QString& title) {
  MessageBox box{prompt, style, title, 0};
  if (m_answerer) box.answer = m_answerer(box);
  if (box.answer == 0 && !m_answers.empty()) {
    box.answer = m_answers.front();
    m_answers.pop_front();
  }
  if (box.answer == 0) box.answer = defaultAnswer(style);
  m_boxes.push_back(box);
  return box.answer;
}

ide::Cursor HeadlessUi::setCursor(ide::Cursor cursor) {
  return std::exchange(m_cursor, cursor);
}

void HeadlessUi::showSplash(const QString& text) {
  m_splash = text;
  m_splashHistory.push_back(text);
}

bool HeadlessUi::openDocument(const QString& path) {
  if (!m_canOpenDocuments) return false;
  m_documents.push_back(path);
  return true;
}

}  // namespace host
