// SPDX-License-Identifier: MIT
#include "qtplatform.h"

#include <QApplication>
#include <QDesktopServices>
#include <QFileInfo>
#include <QMessageBox>
#include <QPainter>
#include <QPushButton>
#include <QSplashScreen>
#include <QTimer>
#include <QUrl>

#include <cstdio>
#include <exception>

namespace desktop {

Q_LOGGING_CATEGORY(lcIde, "quimbel.ide", QtInfoMsg)

namespace {

/// Work the IDE runs from its loop must not throw into Qt's event dispatch.
void runGuarded(const std::function<void()>& work) {
  try {
    work();
  } catch (const std::exception& e) {
    qCWarning(lcIde, "a timer or posted call failed: %s", e.what());
  } catch (...) {
    qCWarning(lcIde, "a timer or posted call failed");
  }
}

struct ButtonAnswer {
  QMessageBox::StandardButton button;
  int answer;
};

// The third button is the default one (vbDefaultButton3).
constexpr int kDefaultButton3 = 512;

constexpr ButtonAnswer kAnswers[] = {
    {QMessageBox::Ok, ide::mb::OK},         {QMessageBox::Cancel, ide::mb::Cancel},
    {QMessageBox::Abort, ide::mb::Abort},   {QMessageBox::Retry, ide::mb::Retry},
    {QMessageBox::Ignore, ide::mb::Ignore}, {QMessageBox::Yes, ide::mb::Yes},
    {QMessageBox::No, ide::mb::No},
};

std::vector<QMessageBox::StandardButton> buttonsOf(int style) {
  switch (ide::mb::buttonsOf(style)) {
    case ide::mb::OKCancel:
      return {QMessageBox::Ok, QMessageBox::Cancel};
    case ide::mb::AbortRetryIgnore:
      return {QMessageBox::Abort, QMessageBox::Retry, QMessageBox::Ignore};
    case ide::mb::YesNoCancel:
      return {QMessageBox::Yes, QMessageBox::No, QMessageBox::Cancel};
    case ide::mb::YesNo:
      return {QMessageBox::Yes, QMessageBox::No};
    case ide::mb::RetryCancel:
      return {QMessageBox::Retry, QMessageBox::Cancel};
    default:
      return {QMessageBox::Ok};
  }
}

QMessageBox::Icon iconOf(int style) {
  switch (ide::mb::iconOf(style)) {
    case ide::mb::Critical:
      return QMessageBox::Critical;
    case ide::mb::Question:
      return QMessageBox::Question;
    case ide::mb::Exclamation:
      return QMessageBox::Warning;
    case ide::mb::Information:
      return QMessageBox::Information;
    default:
      return QMessageBox::NoIcon;
  }
}

int answerOf(QMessageBox::StandardButton button) {
  for (const ButtonAnswer& entry : kAnswers)
    if (entry.button == button) return entry.answer;
  return ide::mb::Cancel;
}

QPixmap splashPicture(const QString& text) {
  QPixmap picture(420, 160);
  picture.fill(QColor(0x1f, 0x3a, 0x68));
  QPainter painter(&picture);
  painter.setRenderHint(QPainter::Antialiasing);
  painter.setPen(Qt::NoPen);
  painter.setBrush(QColor(0x3d, 0x6f, 0xb5));
  painter.drawEllipse(QRectF(-60, 70, 200, 200));
  painter.setPen(Qt::white);
  QFont font = painter.font();
  font.setPointSize(16);
  font.setBold(true);
  painter.setFont(font);
  painter.drawText(QRect(150, 30, 260, 40), Qt::AlignLeft | Qt::AlignVCenter, text);
  return picture;
}

}  // namespace

// ---------------------------------------------------------------------------------------------------
// Loop

QtEventLoop::QtEventLoop() {
  m_clock.start();
}

QtEventLoop::~QtEventLoop() = default;

int QtEventLoop::SetTimer(int intervalMs, std::function<void()> callback) {
  if (intervalMs < 0 || !callback) return 0;
  auto* timer = new QTimer(&m_context);
  timer->setInterval(intervalMs);
  QObject::connect(timer, &QTimer::timeout, &m_context, [work = std::move(callback)] { runGuarded(work); });
  const int id = m_nextId++;
  m_timers.emplace(id, timer);
  timer->start();
  return id;
}

bool QtEventLoop::KillTimer(int timerId) {
  const auto it = m_timers.find(timerId);
  if (it == m_timers.end()) return false;
  if (QTimer* timer = it->second) {
    timer->stop();
    // The timer may be killed from its own callback, which must finish first.
    timer->deleteLater();
  }
  m_timers.erase(it);
  return true;
}

void QtEventLoop::post(std::function<void()> work) {
  QMetaObject::invokeMethod(
      &m_context, [work = std::move(work)] { runGuarded(work); }, Qt::QueuedConnection);
}

void QtEventLoop::DoEvents() {
  const qint64 now = m_clock.elapsed();
  if (now - m_lastYield < kYieldIntervalMs) return;
  m_lastYield = now;
  QCoreApplication::processEvents(QEventLoop::AllEvents);
}

// ---------------------------------------------------------------------------------------------------
// User interface

QtUserInterface::QtUserInterface() = default;
QtUserInterface::~QtUserInterface() {
  if (m_cursor != ide::Cursor::Default) QApplication::restoreOverrideCursor();
}

QObject* QtUserInterface::dialogParent() {
  return m_parent.data();
}

void QtUserInterface::setDialogParent(QWidget* parent) {
  m_parent = parent;
}

int QtUserInterface::takeQueuedAnswer() {
  const int answer = m_answers.front();
  m_answers.pop_front();
  return answer;
}

int QtUserInterface::MsgBox(const QString& prompt, int style, const QString& title) {
  const QString caption = title.isEmpty() ? QStringLiteral("Quimbel IDE") : title;
  if (m_observer) m_observer(caption, prompt);
  if (!m_answers.empty()) return takeQueuedAnswer();

  // Over the dialog in front when there is one, so that a box from inside a dialog is not hidden behind it.
  QWidget* parent = QApplication::activeModalWidget();
  if (!parent) parent = m_parent;
  QMessageBox box(iconOf(style), caption, prompt, QMessageBox::NoButton, parent);
  box.setProperty(kOwnBoxProperty, true);
  const auto buttons = buttonsOf(style);
  for (const auto button : buttons)
    box.addButton(button);
  const size_t defaultIndex = (style & kDefaultButton3) ? 2 : (style & ide::mb::DefaultButton2) ? 1 : 0;
  box.setDefaultButton(buttons[std::min(defaultIndex, buttons.size() - 1)]);
  // Escape answers Cancel where there is one; a lone OK closes with OK, as the IDE's boxes do.
  if (std::find(buttons.begin(), buttons.end(), QMessageBox::Cancel) != buttons.end())
    box.setEscapeButton(QMessageBox::Cancel);
  else if (buttons.size() == 1)
    box.setEscapeButton(buttons.front());
  box.exec();
  QAbstractButton* clicked = box.clickedButton();
  if (!clicked) return answerOf(box.escapeButton() ? box.standardButton(box.escapeButton()) : buttons.back());
  return answerOf(box.standardButton(clicked));
}

ide::Cursor QtUserInterface::setCursor(ide::Cursor cursor) {
  const ide::Cursor previous = m_cursor;
  if (cursor == previous) return previous;
  if (previous != ide::Cursor::Default) QApplication::restoreOverrideCursor();
  if (cursor != ide::Cursor::Default)
    QApplication::setOverrideCursor(cursor == ide::Cursor::Hourglass ? Qt::WaitCursor : Qt::BusyCursor);
  m_cursor = cursor;
  return previous;
}

void QtUserInterface::showSplash(const QString& text) {
  if (text.isEmpty()) {
    if (m_splash) m_splash->close();
    m_splash.reset();
    return;
  }
  if (!m_splash) m_splash = std::make_unique<QSplashScreen>(splashPicture(text));
  m_splash->setPixmap(splashPicture(text));
  m_splash->show();
}

bool QtUserInterface::openDocument(const QString& path) {
  if (!QFileInfo::exists(path)) return false;
  if (!m_openDocuments) {
    std::printf("document: %s\n", qPrintable(path));
    std::fflush(stdout);
    return true;
  }
  return QDesktopServices::openUrl(QUrl::fromLocalFile(path));
}

}  // namespace desktop
