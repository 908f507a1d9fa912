// SPDX-License-Identifier: MIT
#include "optionsdialog.h"
#include "vbfonts.h"

#include <QComboBox>
#include <QDialogButtonBox>
#include <QFormLayout>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QLabel>
#include <QListWidget>
#include <QPainter>
#include <QSettings>
#include <QTabWidget>
#include <QVBoxLayout>

namespace desktop {
namespace {

QIcon swatch(const QColor& colour) {
  QPixmap pixmap(14, 14);
  pixmap.fill(colour);
  QPainter painter(&pixmap);
  painter.setPen(Qt::black);
  painter.drawRect(0, 0, 13, 13);
  return QIcon(pixmap);
}

/// "Auto" and the palette, each item holding its colour (invalid for Auto).
QComboBox* colourBox(const QString& name, QWidget* parent) {
  auto* box = new QComboBox(parent);
  box->setObjectName(name);
  box->addItem(QStringLiteral("Auto"), QColor());
  for (const QColor& colour : CodeColours::palette())
    box->addItem(swatch(colour), colour.name(), colour);
  return box;
}

void selectColour(QComboBox* box, const QColor& colour) {
  for (int i = 0; i < box->count(); ++i)
    if (box->itemData(i).value<QColor>() == colour) return box->setCurrentIndex(i);
  box->setCurrentIndex(0);
}

}  // namespace

OptionsDialog::OptionsDialog(QSettings* settings, QWidget* parent) : QDialog(parent), m_settings(settings) {
  setObjectName(QStringLiteral("frmOptions"));
  setWindowTitle(QStringLiteral("Options"));
  m_colours = CodeColours::instance().scheme();

  auto* tabs = new QTabWidget(this);
  tabs->setObjectName(QStringLiteral("optionTabs"));
  auto* page = new QWidget(tabs);
  auto* colours = new QGroupBox(QStringLiteral("Code Colors"), page);
  m_kinds = new QListWidget(colours);
  m_kinds->setObjectName(QStringLiteral("codeColorList"));
  for (int i = 0; i < kCodeTextKinds; ++i)
    m_kinds->addItem(CodeColours::name(static_cast<CodeText>(i)));
  m_foreground = colourBox(QStringLiteral("foregroundColor"), colours);
  m_background = colourBox(QStringLiteral("backgroundColor"), colours);
  auto* choice = new QFormLayout;
  choice->addRow(QStringLiteral("&Foreground:"), m_foreground);
  choice->addRow(QStringLiteral("&Background:"), m_background);
  auto* colourLayout = new QHBoxLayout(colours);
  colourLayout->addWidget(m_kinds);
  colourLayout->addLayout(choice);
  auto* sampleBox = new QGroupBox(QStringLiteral("Sample"), page);
  m_sample = new QLabel(QStringLiteral("AaBbCcXxYyZz"), sampleBox);
  m_sample->setObjectName(QStringLiteral("sample"));
  m_sample->setFont(codeFont());
  m_sample->setAlignment(Qt::AlignCenter);
  m_sample->setAutoFillBackground(true);
  m_sample->setMinimumHeight(40);
  auto* sampleLayout = new QVBoxLayout(sampleBox);
  sampleLayout->addWidget(m_sample);
  auto* pageLayout = new QVBoxLayout(page);
  pageLayout->addWidget(colours);
  pageLayout->addWidget(sampleBox);
  tabs->addTab(page, QStringLiteral("Editor Format"));

  auto* buttons = new QDialogButtonBox(QDialogButtonBox::Ok | QDialogButtonBox::Cancel, this);
  connect(buttons, &QDialogButtonBox::accepted, this, &OptionsDialog::accept);
  connect(buttons, &QDialogButtonBox::rejected, this, &OptionsDialog::reject);
  auto* layout = new QVBoxLayout(this);
  layout->addWidget(tabs);
  layout->addWidget(buttons);

  connect(m_kinds, &QListWidget::currentRowChanged, this, &OptionsDialog::showKind);
  connect(m_foreground, &QComboBox::currentIndexChanged, this, &OptionsDialog::colourChosen);
  connect(m_background, &QComboBox::currentIndexChanged, this, &OptionsDialog::colourChosen);
  m_kinds->setCurrentRow(0);
}

void OptionsDialog::showKind(int row) {
  if (row < 0) return;
  m_showing = true;
  selectColour(m_foreground, m_colours[row].foreground);
  selectColour(m_background, m_colours[row].background);
  m_showing = false;
  updateSample();
}

void OptionsDialog::colourChosen() {
  const int row = m_kinds->currentRow();
  if (m_showing || row < 0) return;
  m_colours[row] = {m_foreground->currentData().value<QColor>(), m_background->currentData().value<QColor>()};
  updateSample();
}

void OptionsDialog::updateSample() {
  const int row = std::max(0, m_kinds->currentRow());
  // Automatic shows what the code window would draw.
  const auto kind = static_cast<CodeText>(row);
  const QColor foreground = CodeColours::foreground(m_colours, kind);
  const QColor background = CodeColours::background(m_colours, kind);
  QPalette palette = m_sample->palette();
  palette.setColor(QPalette::WindowText, foreground);
  palette.setColor(QPalette::Window, background);
  m_sample->setPalette(palette);
}

void OptionsDialog::accept() {
  for (int i = 0; i < kCodeTextKinds; ++i)
    CodeColours::instance().setColour(static_cast<CodeText>(i), m_colours[i]);
  if (m_settings) {
    CodeColours::instance().save(*m_settings);
    m_settings->sync();
  }
  QDialog::accept();
}

}  // namespace desktop
