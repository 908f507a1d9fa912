// SPDX-License-Identifier: MIT
// The line-numbering dialog.
#include "transform/frmlinnumbers.h"

#include "common/errors.h"
#include "common/strings.h"
#include "transform/numberwalk.h"
#include "transform/options.h"
#include "transform/texts.h"

#include <QGridLayout>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QLabel>
#include <QProgressBar>
#include <QPushButton>
#include <QRadioButton>
#include <QVBoxLayout>

namespace transform {

using namespace walk;

namespace {

// How long the finished run stays on screen before the dialog closes itself.
constexpr int kCloseDelayMs = 1000;

}  // namespace

frmLinNumbers::frmLinNumbers(ide::Ref<ide::VBE> vbe, common::SettingsStore& settings,
                             const common::Options& options, QWidget* parent)
    : QDialog(parent),
      m_vbe(std::move(vbe)),
      m_settings(settings),
      m_options(options),
      m_txtInitial(new NumberBox(this)),
      m_txtInterval(new NumberBox(this)),
      m_cmdAdd(new QPushButton(this)),
      m_cmdRemove(new QPushButton(this)),
      m_cmdCancel(new QPushButton(this)),
      m_progBar(new QProgressBar(this)),
      m_frOptions(new QGroupBox(this)),
      m_lblStartNum(new QLabel(this)),
      m_lblInterval(new QLabel(this)),
      m_bar(*m_progBar),
      m_context(QStringLiteral("frmLinNumbers"), &m_vbe->Platform().loop(), &m_bar) {
  setWindowTitle(common::title() + QStringLiteral(" - ") + common::LoadResString(kNumbersCaption));
  m_txtInitial->setObjectName(QStringLiteral("txtInitial"));
  m_txtInterval->setObjectName(QStringLiteral("txtInterval"));
  m_cmdAdd->setObjectName(QStringLiteral("cmdAdd"));
  m_cmdRemove->setObjectName(QStringLiteral("cmdRemove"));
  m_cmdCancel->setObjectName(QStringLiteral("cmdCancel"));
  m_progBar->setObjectName(QStringLiteral("ProgBar"));
  m_frOptions->setObjectName(QStringLiteral("frOptions"));
  m_lblStartNum->setObjectName(QStringLiteral("lblStartNum"));
  m_lblInterval->setObjectName(QStringLiteral("lblInterval"));

  m_cmdAdd->setText(common::LoadResString(kAddNumbersButton));
  m_cmdCancel->setText(common::LoadResString(kNumbersClose));
  m_cmdRemove->setText(common::LoadResString(kRemoveNumbersButton));
  m_frOptions->setTitle(common::LoadResString(kNumbersFrame));
  m_lblInterval->setText(common::LoadResString(kIntervalLabel));
  m_lblStartNum->setText(common::LoadResString(kStartNumberLabel));
  m_lblStartNum->setBuddy(m_txtInitial);
  m_lblInterval->setBuddy(m_txtInterval);
  auto* scopes = new QVBoxLayout(m_frOptions);
  for (int i = 0; i < 3; ++i) {
    m_opNumbers[size_t(i)] = new QRadioButton(common::LoadResString(kNumberScopeFirst + i), m_frOptions);
    m_opNumbers[size_t(i)]->setObjectName(QStringLiteral("opNumbers%1").arg(i));
    scopes->addWidget(m_opNumbers[size_t(i)]);
  }
  for (QPushButton* button : {m_cmdAdd, m_cmdRemove, m_cmdCancel})
    button->setAutoDefault(false);

  auto* boxes = new QGridLayout;
  boxes->addWidget(m_lblStartNum, 0, 0);
  boxes->addWidget(m_txtInitial, 0, 1);
  boxes->addWidget(m_lblInterval, 1, 0);
  boxes->addWidget(m_txtInterval, 1, 1);
  auto* buttons = new QVBoxLayout;
  buttons->addWidget(m_cmdAdd);
  buttons->addWidget(m_cmdRemove);
  buttons->addWidget(m_cmdCancel);
  buttons->addStretch();
  auto* left = new QVBoxLayout;
  left->addWidget(m_frOptions);
  left->addLayout(boxes);
  auto* top = new QHBoxLayout;
  top->addLayout(left, 1);
  top->addLayout(buttons);
  auto* layout = new QVBoxLayout(this);
  layout->addLayout(top);
  layout->addWidget(m_progBar);
  m_progBar->setTextVisible(false);
  m_progBar->hide();

  connect(m_cmdAdd, &QPushButton::clicked, this, &frmLinNumbers::cmdAdd_Click);
  connect(m_cmdRemove, &QPushButton::clicked, this, &frmLinNumbers::cmdRemove_Click);
  connect(m_cmdCancel, &QPushButton::clicked, this, &frmLinNumbers::cmdCancel_Click);

  // Walks report their failure with the message of the walk that caught it; lines they pass over are
  // not reported.
  m_context.onFailure = [this](const WalkFailure& failure) {
    const int id = failure.messageId ? failure.messageId : walkMessageId(scope(), false);
    m_vbe->Platform().ui().MsgBox(walkFailureText(common::LoadResString(id), failure, *m_vbe, scope()),
                                  ide::mb::Exclamation, common::title());
  };

  const NumberingOptions stored = storedNumbering(m_settings);
  m_startNumber = stored.startNumber;
  m_interval = stored.interval;
  m_txtInitial->setText(QString::number(m_startNumber));
  m_txtInterval->setText(QString::number(m_interval));
  m_opNumbers[2]->setChecked(true);
}

frmLinNumbers::~frmLinNumbers() {
  killCloseTimer();
}

PROG_MODE frmLinNumbers::scope() const {
  if (m_opNumbers[0]->isChecked()) return PROG_PROJECT;
  if (m_opNumbers[1]->isChecked()) return PROG_MODULE;
  return PROG_PROCEDURE;
}

bool frmLinNumbers::readBox(QLineEdit* box, qint32& field, int messageId) {
  if (box->text().trimmed().isEmpty()) return true;  // an empty box keeps the value last used
  const auto value = wholeNumber(box->text());
  if (!value) {
    m_vbe->Platform().ui().MsgBox(common::LoadResString(messageId), ide::mb::Exclamation, common::title());
    box->setFocus();
    return false;
  }
  field = *value;
  return true;
}

void frmLinNumbers::run(bool add) {
  if (m_running || m_closeTimer) return;
  if (!readBox(m_txtInitial, m_startNumber, kStartNotNumeric)) return;
  if (!readBox(m_txtInterval, m_interval, kIntervalNotNumeric)) return;

  ide::Platform& platform = m_vbe->Platform();
  m_cursor.emplace(platform.ui());
  m_cmdAdd->setEnabled(false);
  m_cmdRemove->setEnabled(false);
  m_cmdCancel->setText(common::LoadResString(kNumbersCancel));
  m_cmdCancel->repaint();
  m_running = true;
  m_closeAfterRun = false;
  m_context.reset();
  platform.loop().DoEvents();

  bool completed = false;
  try {
    walk(scope(), add);
    completed = true;
  } catch (const std::exception& failure) {
    // What reaches the button (no active project, a related document chosen as the module) is not
    // shown: the dialog simply goes back to idle.
    common::logFailure(failure, QStringLiteral("frmLinNumbers"), QStringLiteral("run"), __LINE__);
  }
  m_running = false;
  m_numIndentError.disconnect();
  m_numIndent.reset();

  if (!completed) {
    backToIdle();
    if (m_closeAfterRun) close();
    return;
  }
  if (m_closeAfterRun || m_context.cancelled()) {
    backToIdle();
    close();
    return;
  }
  // The full bar stays a moment before the dialog closes; the IDE's loop keeps running meanwhile.
  m_closeTimer = platform.loop().SetTimer(kCloseDelayMs, [this] { closeAfterWait(); });
  if (!m_closeTimer) closeAfterWait();
}

void frmLinNumbers::walk(PROG_MODE scope, bool add) {
  if (m_options.OneCommandNumIndent) {
    if (m_context.cancelled()) return;  // Cancel was clicked before the command existed
    m_numIndent = std::make_unique<CNumIndent>(m_vbe);
    // The walk's message with the exclamation icon, naming the module and line, as the own walks report.
    m_numIndentError = m_numIndent->Failed.connect([this, scope](const WalkFailure& failure) {
      const int id = failure.messageId ? failure.messageId
                                       : walkMessageId(scope, failure.operation.startsWith(u"Indent"));
      m_vbe->Platform().ui().MsgBox(walkFailureText(common::LoadResString(id), failure, *m_vbe, scope),
                                    ide::mb::Exclamation, common::title());
      m_context.Cancel();
    });
    m_numIndent->DoIt(scope, &m_bar, m_startNumber, m_interval, false, 1, add);
    return;
  }

  CountUnits(m_context, *m_vbe, scope, ProgressUnit::Members);
  NumberingWalk numbering(m_context, m_startNumber, m_interval);
  switch (scope) {
    case PROG_PROJECT:
      numbering.NumberProject(activeProject(*m_vbe), add);
      break;
    case PROG_MODULE: {
      auto component = selectedComponent(*m_vbe);
      // A related document has no code: the run stops without a change or a message.
      if (component->Type() == ide::ComponentType::RelatedDocument) ide::raise(ide::err::CannotEdit);
      numbering.NumberModule(component->CodeModule(), add);
      break;
    }
    default:
      numbering.NumberCurrentProcedure(*m_vbe, add);
      break;
  }
}

void frmLinNumbers::cmdCancel_Click() {
  if (m_running)
    cancelRun();
  else
    close();  // idle, or the finished run's full bar showing before the close
}

void frmLinNumbers::cancelRun() {
  // The walk ends at its next yield; the dialog closes once it has.
  if (m_numIndent) m_numIndent->Cancel();
  m_context.Cancel();
  m_closeAfterRun = true;
}

void frmLinNumbers::closeAfterWait() {
  killCloseTimer();
  backToIdle();
  close();
}

void frmLinNumbers::backToIdle() {
  m_progBar->hide();
  m_cmdRemove->setEnabled(true);
  m_cmdAdd->setEnabled(true);
  m_cmdCancel->setText(common::LoadResString(kNumbersClose));
  m_cmdCancel->repaint();
  m_cursor.reset();
}

void frmLinNumbers::killCloseTimer() {
  if (!m_closeTimer) return;
  m_vbe->Platform().loop().KillTimer(m_closeTimer);
  m_closeTimer = 0;
}

void frmLinNumbers::done(int result) {
  if (m_running) {
    cancelRun();  // closing the window during a run is a cancel
    return;
  }
  killCloseTimer();
  if (m_cursor) backToIdle();
  Form_Unload();
  QDialog::done(result);
}

void frmLinNumbers::Form_Unload() {
  // Whatever number a box holds at the close is kept for the next time, whether it was run or not; an
  // empty box or one that is not a number leaves the setting alone.
  const auto remember = [this](QLineEdit* box, const common::setting::Key& key) {
    const QString value = box->text().trimmed();
    const auto number = wholeNumber(value);
    if (number && number != wholeNumber(m_settings.value(key))) m_settings.setValue(key, value);
  };
  remember(m_txtInitial, common::setting::InitialNumber);
  remember(m_txtInterval, common::setting::Interval);
}

}  // namespace transform
