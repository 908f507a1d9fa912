// SPDX-License-Identifier: MIT
// The indentation dialog.
#include "transform/frmindenter.h"

#include "common/errors.h"
#include "common/strings.h"
#include "transform/indentwalk.h"
#include "transform/options.h"
#include "transform/texts.h"

#include <QGroupBox>
#include <QHBoxLayout>
#include <QProgressBar>
#include <QPushButton>
#include <QRadioButton>
#include <QVBoxLayout>

namespace transform {

using namespace walk;

namespace {

// The numbering that number-and-indent applies when the indenter hands it the run.
constexpr qint32 kOneCommandStart = 10000;
constexpr qint32 kOneCommandInterval = 5;

}  // namespace

frmIndenter::frmIndenter(ide::Ref<ide::VBE> vbe, common::SettingsStore& settings,
                         const common::Options& options, QWidget* parent)
    : QDialog(parent),
      m_vbe(std::move(vbe)),
      m_settings(settings),
      m_options(options),
      m_txtSpaces(new NumberBox(this)),
      m_cmdIndent(new QPushButton(this)),
      m_cmdCancel(new QPushButton(this)),
      m_progBar(new QProgressBar(this)),
      m_frIndent(new QGroupBox(this)),
      m_frUse(new QGroupBox(this)),
      m_bar(*m_progBar),
      m_context(QStringLiteral("frmIndenter"), &m_vbe->Platform().loop(), &m_bar) {
  setWindowTitle(common::title() + QStringLiteral(" - ") + common::LoadResString(kIndenterCaption));
  m_txtSpaces->setObjectName(QStringLiteral("txtSpaces"));
  m_cmdIndent->setObjectName(QStringLiteral("cmdIndent"));
  m_cmdCancel->setObjectName(QStringLiteral("cmdCancel"));
  m_progBar->setObjectName(QStringLiteral("ProgBar"));
  m_frIndent->setObjectName(QStringLiteral("frIndent"));
  m_frUse->setObjectName(QStringLiteral("frUse"));

  m_cmdCancel->setText(common::LoadResString(kIndenterClose));
  m_cmdIndent->setText(common::LoadResString(kIndentButton));
  m_frIndent->setTitle(common::LoadResString(kIndentFrame));
  m_frUse->setTitle(common::LoadResString(kUseFrame));
  auto* scopes = new QVBoxLayout(m_frIndent);
  for (int i = 0; i < 3; ++i) {
    m_opIndent[size_t(i)] = new QRadioButton(common::LoadResString(kIndentScopeFirst + i), m_frIndent);
    m_opIndent[size_t(i)]->setObjectName(QStringLiteral("opIndent%1").arg(i));
    scopes->addWidget(m_opIndent[size_t(i)]);
  }
  auto* use = new QVBoxLayout(m_frUse);
  for (int i = 0; i < 2; ++i) {
    m_opSpaces[size_t(i)] = new QRadioButton(common::LoadResString(kIndentCharsFirst + i), m_frUse);
    m_opSpaces[size_t(i)]->setObjectName(QStringLiteral("opSpaces%1").arg(i));
    connect(m_opSpaces[size_t(i)], &QRadioButton::clicked, this, [this, i] { opSpaces_Click(i); });
  }
  use->addWidget(m_opSpaces[0]);
  auto* spacesRow = new QHBoxLayout;
  spacesRow->addWidget(m_opSpaces[1]);
  spacesRow->addWidget(m_txtSpaces);
  use->addLayout(spacesRow);
  for (QPushButton* button : {m_cmdIndent, m_cmdCancel})
    button->setAutoDefault(false);

  auto* buttons = new QVBoxLayout;
  buttons->addWidget(m_cmdIndent);
  buttons->addWidget(m_cmdCancel);
  buttons->addStretch();
  auto* frames = new QHBoxLayout;
  frames->addWidget(m_frIndent);
  frames->addWidget(m_frUse);
  auto* top = new QHBoxLayout;
  top->addLayout(frames, 1);
  top->addLayout(buttons);
  auto* layout = new QVBoxLayout(this);
  layout->addLayout(top);
  layout->addWidget(m_progBar);
  m_progBar->setTextVisible(false);
  m_progBar->hide();

  connect(m_cmdIndent, &QPushButton::clicked, this, &frmIndenter::cmdIndent_Click);
  connect(m_cmdCancel, &QPushButton::clicked, this, &frmIndenter::cmdCancel_Click);

  m_context.onFailure = [this](const WalkFailure& failure) {
    const int id = failure.messageId ? failure.messageId : walkMessageId(scope(), true);
    m_vbe->Platform().ui().MsgBox(walkFailureText(common::LoadResString(id), failure, *m_vbe, scope()),
                                  ide::mb::Exclamation, common::title());
  };

  m_txtSpaces->setText(m_settings.value(common::setting::Indentation).trimmed());
  const QString useOption = m_settings.value(common::setting::UseOption).trimmed();
  const bool spaces = !useOption.isEmpty() && useOption != u"0";  // an empty value counts as tabs
  m_opSpaces[spaces ? 1 : 0]->setChecked(true);
  m_opIndent[2]->setChecked(true);
}

frmIndenter::~frmIndenter() = default;

PROG_MODE frmIndenter::scope() const {
  if (m_opIndent[0]->isChecked()) return PROG_PROJECT;
  if (m_opIndent[1]->isChecked()) return PROG_MODULE;
  return PROG_PROCEDURE;
}

bool frmIndenter::spaceMode() const {
  return m_opSpaces[1]->isChecked();
}

void frmIndenter::opSpaces_Click(int index) {
  if (index == 1 && isVisible()) m_txtSpaces->setFocus();
}

void frmIndenter::cmdIndent_Click() {
  if (m_running) return;
  ide::UserInterface& ui = m_vbe->Platform().ui();
  qint32 unit = 1;
  if (spaceMode()) {
    const QString spaces = m_txtSpaces->text().trimmed();
    const auto value = wholeNumber(spaces);
    if (spaces.isEmpty() || !value || *value <= 0) {
      ui.MsgBox(common::LoadResString(spaces.isEmpty() ? kNoSpaces : kInvalidSpaces), ide::mb::Information,
                common::title());
      m_txtSpaces->setFocus();
      return;
    }
    unit = *value;
  }

  BusyCursor cursor(ui);
  m_context.reset();
  m_cmdIndent->setEnabled(false);
  m_cmdCancel->setText(common::LoadResString(kIndenterCancel));
  m_cmdCancel->repaint();
  m_running = true;
  m_closeAfterRun = false;

  bool completed = false;
  try {
    walk(scope(), unit);
    completed = true;
  } catch (const std::exception& failure) {
    common::logFailure(failure, QStringLiteral("frmIndenter"), QStringLiteral("cmdIndent_Click"), __LINE__);
    ui.MsgBox(common::LoadResString(kIndentRunFailed), ide::mb::Information, common::title());
  }
  m_running = false;
  m_numIndentError.disconnect();
  m_numIndent.reset();
  if (completed || m_closeAfterRun) {
    close();
    return;
  }
  // A run that failed as a whole leaves the dialog open, so that another scope can be chosen.
  m_progBar->hide();
  m_cmdIndent->setEnabled(true);
  m_cmdCancel->setText(common::LoadResString(kIndenterClose));
}

void frmIndenter::walk(PROG_MODE scope, qint32 unit) {
  if (m_options.OneCommandNumIndent) {
    m_numIndent = std::make_unique<CNumIndent>(m_vbe);
    // The walk's message with the exclamation icon, naming the module and line, as the own walks report.
    m_numIndentError = m_numIndent->Failed.connect([this, scope](const WalkFailure& failure) {
      const int id = failure.messageId ? failure.messageId : walkMessageId(scope, true);
      m_vbe->Platform().ui().MsgBox(walkFailureText(common::LoadResString(id), failure, *m_vbe, scope),
                                    ide::mb::Exclamation, common::title());
      m_context.Cancel();
    });
    m_numIndent->DoIt(scope, &m_bar, kOneCommandStart, kOneCommandInterval, spaceMode(), unit, true);
    return;
  }

  CountUnits(m_context, *m_vbe, scope, ProgressUnit::Lines);
  IndentationWalk indentation(m_context, spaceMode() ? IndentMode::Spaces : IndentMode::Tabs, unit);
  switch (scope) {
    case PROG_PROJECT:
      indentation.IndentProject(activeProject(*m_vbe));
      break;
    case PROG_MODULE:
      indentation.IndentModule(selectedComponent(*m_vbe)->CodeModule());
      break;
    default:
      indentation.IndentCurrentProcedure(*m_vbe);
      break;
  }
}

void frmIndenter::cmdCancel_Click() {
  if (m_running)
    cancelRun();
  else
    close();
}

void frmIndenter::cancelRun() {
  // The walk ends at its next yield, and the run then closes the dialog.
  if (m_numIndent) m_numIndent->Cancel();
  m_context.Cancel();
  m_closeAfterRun = true;
  m_cmdCancel->setText(common::LoadResString(kIndenterClose));
}

void frmIndenter::done(int result) {
  if (m_running) {
    cancelRun();  // closing the window during a run is a cancel
    return;
  }
  Form_Unload();
  QDialog::done(result);
}

void frmIndenter::Form_Unload() {
  if (!spaceMode()) {
    m_settings.setValue(common::setting::UseOption, QStringLiteral("0"));
    return;
  }
  m_settings.setValue(common::setting::UseOption, QStringLiteral("1"));
  if (const auto spaces = wholeNumber(m_txtSpaces->text())) {
    m_settings.setValue(common::setting::Indentation, QString::number(*spaces));
  }
}

}  // namespace transform
