// SPDX-License-Identifier: MIT
// The options dialog.
#include "designer/frmoptions.h"

#include "common/errors.h"
#include "common/strings.h"
#include "designer/texts.h"
#include "designer/values.h"

#include <QCheckBox>
#include <QGridLayout>
#include <QHBoxLayout>
#include <QLineEdit>
#include <QPushButton>
#include <QVBoxLayout>

namespace designer {
namespace {

struct OptionRow {
  const char* box;
  const char16_t* label;
  const common::setting::Key& key;
};

// In the order of frmOptions::Option.
const OptionRow kRows[] = {
    {"ckShowProperties", kShowPropertiesLabel, common::setting::ShowProperties},
    {"ckNumIndent", kNumIndentLabel, common::setting::OneCommandNumIndent},
    {"ckLabelTransp", kLabelTranspLabel, common::setting::LabelsTransparent},
    {"ckTextBox1", kTextBox1Label, common::setting::ClearTextProperty},
    {"ckFormPos", kFormPosLabel, common::setting::FormsPosition},
    {"ckBorderStyle", kBorderStyleLabel, common::setting::FormsBorder},
    {"ckSelTextBox", kSelTextBoxLabel, common::setting::SelectTextBoxOnFocus},
    {"ckTextUcase", kTextUcaseLabel, common::setting::TextBoxUpperCase},
    {"ckControlRenamed", kControlRenamedLabel, common::setting::RenameInCodeOnControlRenamed},
};
static_assert(std::size(kRows) == frmOptions::OptionCount);

// The order OK saves them in.
constexpr frmOptions::Option kSaveOrder[] = {
    frmOptions::NumIndent,  frmOptions::ShowProperties, frmOptions::LabelTransp,
    frmOptions::TextBox1,   frmOptions::FormPos,        frmOptions::BorderStyle,
    frmOptions::SelTextBox, frmOptions::TextUcase,      frmOptions::ControlRenamed};

}  // namespace

frmOptions::frmOptions(common::SettingsStore& settings, common::Options& options, ide::UserInterface& ui,
                       QWidget* parent)
    : QDialog(parent),
      m_settings(settings),
      m_options(options),
      m_ui(ui),
      m_txtCor(new QLineEdit(this)),
      m_cmdCor(new QPushButton(QString::fromUtf16(kColourButton), this)),
      m_cmdOK(new QPushButton(QString::fromUtf16(kOK), this)),
      m_cmdCancel(new QPushButton(QString::fromUtf16(kCancel), this)) {
  setWindowTitle(QString::fromUtf16(kOptionsCaption));
  setObjectName(QStringLiteral("frmOptions"));
  auto* grid = new QGridLayout;
  grid->setHorizontalSpacing(6);
  grid->setColumnStretch(1, 1);
  for (int i = 0; i < OptionCount; ++i) {
    auto* box = new QCheckBox(this);
    box->setObjectName(QString::fromLatin1(kRows[i].box));
    auto* label = new ToggleLabel(QString::fromUtf16(kRows[i].label), box, this);
    label->setObjectName(QStringLiteral("lbl") + QString::fromLatin1(kRows[i].box).mid(2));
    label->setWordWrap(true);
    grid->addWidget(box, i, 0, Qt::AlignTop);
    grid->addWidget(label, i, 1);
    m_boxes[size_t(i)] = box;
    m_labels[size_t(i)] = label;
  }
  m_txtCor->setObjectName(QStringLiteral("txtCor"));
  m_cmdCor->setObjectName(QStringLiteral("cmdCor"));
  m_cmdOK->setObjectName(QStringLiteral("cmdOK"));
  m_cmdCancel->setObjectName(QStringLiteral("cmdCancel"));
  m_cmdCor->setFixedWidth(m_cmdCor->fontMetrics().horizontalAdvance(QStringLiteral("....")) + 16);
  m_txtCor->setMaximumWidth(120);

  auto* lblCor = new QLabel(QString::fromUtf16(kOptionsColourLabel), this);
  lblCor->setObjectName(QStringLiteral("lblCor"));
  lblCor->setBuddy(m_txtCor);
  auto* colour = new QHBoxLayout;
  colour->addWidget(lblCor);
  colour->addWidget(m_txtCor);
  colour->addWidget(m_cmdCor);
  colour->addStretch(1);
  auto* buttons = new QHBoxLayout;
  buttons->addStretch(1);
  buttons->addWidget(m_cmdOK);
  buttons->addWidget(m_cmdCancel);
  auto* layout = new QVBoxLayout(this);
  layout->addLayout(grid);
  layout->addSpacing(6);
  layout->addLayout(colour);
  layout->addSpacing(6);
  layout->addLayout(buttons);
  setMinimumWidth(480);

  connect(m_cmdCor, &QPushButton::clicked, this, [this] { cmdCor_Click(); });
  connect(m_cmdOK, &QPushButton::clicked, this, [this] { cmdOK_Click(); });
  connect(m_cmdCancel, &QPushButton::clicked, this, &QDialog::reject);
  Form_Activate();
}

void frmOptions::Form_Activate() {
  for (int i = 0; i < OptionCount; ++i)
    m_boxes[size_t(i)]->setChecked(m_settings.flag(kRows[i].key));
  m_txtCor->setText(m_settings.value(common::setting::ColorOnFocus));
}

void frmOptions::cmdCor_Click() {
  // Cancelling the colour dialog changes nothing.
  if (const std::optional<QColor> chosen = m_chooseColour(this, colourOf(m_txtCor->text())))
    m_txtCor->setText(colourLiteral(*chosen));
}

void frmOptions::cmdOK_Click() {
  try {
    const QString colour = m_txtCor->text().trimmed();
    if (!isColourText(colour)) {
      m_ui.MsgBox(QString::fromUtf16(kOptionsColourNotNumeric), ide::mb::OKOnly, common::title());
      m_txtCor->setFocus();
      m_txtCor->selectAll();
      return;
    }
    // An empty colour box keeps the stored colour.
    if (!colour.isEmpty()) m_settings.setValue(common::setting::ColorOnFocus, colour);
    for (const Option option : kSaveOrder)
      m_settings.setFlag(kRows[option].key, m_boxes[size_t(option)]->isChecked());
    m_options = common::GetOptionsFromRegistry(m_settings);
    accept();
  } catch (const std::exception& failure) {
    common::recordError(failure, QStringLiteral("frmOptions"), QStringLiteral("cmdOK_Click"), __LINE__);
    common::ShowErrorReport(m_ui);
  }
}

}  // namespace designer
