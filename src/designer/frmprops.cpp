// SPDX-License-Identifier: MIT
// The control property defaults dialog.
#include "designer/frmprops.h"

#include "common/errors.h"
#include "common/strings.h"
#include "designer/texts.h"
#include "designer/values.h"

#include <QApplication>
#include <QCheckBox>
#include <QGridLayout>
#include <QHBoxLayout>
#include <QKeyEvent>
#include <QLineEdit>
#include <QListWidget>
#include <QPushButton>
#include <QToolButton>
#include <QVBoxLayout>
#include <QValidator>

namespace designer {
namespace {

const QString kModule = QStringLiteral("frmProps");
constexpr int kVisibleListItems = 6;
constexpr long kInvalidValue = 380;  // "Invalid property value"

/// Letters typed or pasted into the colour box become capitals.
class UpperCaseValidator final : public QValidator {
 public:
  using QValidator::QValidator;
  State validate(QString& input, int&) const override {
    input = input.toUpper();
    return Acceptable;
  }
};

bool isEnter(QEvent* event) {
  if (event->type() != QEvent::KeyPress) return false;
  const int key = static_cast<QKeyEvent*>(event)->key();
  return key == Qt::Key_Return || key == Qt::Key_Enter;
}

bool isIndex(const CVBCTProperty& row) {
  return row.PropertyName.compare(QLatin1StringView("Index"), Qt::CaseInsensitive) == 0;
}

/// Name and Index are written together (writeIdentity).
bool isIdentity(const CVBCTProperty& row) {
  return isIndex(row) || row.PropertyName.compare(QLatin1StringView("Name"), Qt::CaseInsensitive) == 0;
}

/// What a row writes: its value, -1 for an emptied Index.
QVariant valueToWrite(const CVBCTProperty& row) {
  if (isIndex(row) && valueText(row.SelectedValue.Value).isEmpty()) return -1;
  return row.SelectedValue.Value;
}

/// Focus that leaves or comes back with the whole window (a message box, another application) is no
/// move between the dialog's fields.
bool isWindowFocusChange(QEvent* event) {
  const Qt::FocusReason reason = static_cast<QFocusEvent*>(event)->reason();
  return reason == Qt::ActiveWindowFocusReason || reason == Qt::PopupFocusReason;
}

/// The model's failure to write a property, whose texts are the IDE's English ones, in the dialog's
/// language: the numbers writing a typed value can meet. `text` is what was typed (for Name and Index,
/// the name with the index of an array element).
ide::Error inDialogLanguage(const std::exception& failure, const QString& property, const QString& text) {
  const auto* error = dynamic_cast<const ide::Error*>(&failure);
  if (!error) return ide::Error(ide::err::InvalidProcedureCall, QString::fromLocal8Bit(failure.what()));
  switch (error->number()) {
    case kOverflow:
    case kTypeMismatch:
    case kInvalidValue:
      return ide::Error(error->number(), QString::fromUtf16(kInvalidPropertyValue).arg(property, text));
    case ide::err::NameConflict:
      return ide::Error(error->number(), QString::fromUtf16(kControlNameInUse).arg(text));
    case ide::err::InvalidName:
      return ide::Error(error->number(), QString::fromUtf16(kInvalidControlName).arg(text));
    default:
      return *error;
  }
}

void setBase(QWidget* widget, const QColor& colour) {
  QPalette palette = widget->palette();
  palette.setColor(QPalette::Base, colour);
  widget->setPalette(palette);
}

}  // namespace

frmProps::frmProps(ide::Ref<ide::VBControl> control, const common::Options& options, ide::UserInterface& ui,
                   QWidget* parent)
    : QDialog(parent),
      m_control(std::move(control)),
      m_options(options),
      m_ui(ui),
      m_cmdSeta(new QToolButton(this)),
      m_lstColeta(new QListWidget(this)),
      m_ckEnterTab(new QCheckBox(this)),
      m_ckBackColor(new QCheckBox(this)),
      m_txtCor(new QLineEdit(this)),
      m_cmdCor(new QPushButton(QString::fromUtf16(kColourButton), this)),
      m_cmdOK(new QPushButton(QString::fromUtf16(kOK), this)),
      m_cmdCancel(new QPushButton(QString::fromUtf16(kCancel), this)) {
  setWindowTitle(common::title() + QString::fromUtf16(kPropsCaptionSuffix));
  setObjectName(QStringLiteral("frmProps"));
  auto* rows = new QGridLayout;
  rows->setColumnMinimumWidth(0, 90);
  rows->setColumnStretch(1, 1);
  rows->setVerticalSpacing(3);
  for (int i = 0; i < kRows; ++i) {
    auto* label = new QLabel(this);
    auto* box = new QLineEdit(this);
    label->setObjectName(QStringLiteral("lblProp%1").arg(i));
    box->setObjectName(QStringLiteral("txtValor%1").arg(i));
    label->setBuddy(box);
    box->installEventFilter(this);
    rows->addWidget(label, i, 0);
    rows->addWidget(box, i, 1);
    m_lblProp[size_t(i)] = label;
    m_txtValor[size_t(i)] = box;
  }
  m_cmdSeta->setObjectName(QStringLiteral("cmdSeta"));
  m_cmdSeta->setArrowType(Qt::DownArrow);
  m_cmdSeta->setFocusPolicy(Qt::NoFocus);  // a click leaves the focus in the box until the list takes it
  m_cmdSeta->hide();
  m_lstColeta->setObjectName(QStringLiteral("lstColeta"));
  m_lstColeta->hide();
  m_lstColeta->installEventFilter(this);
  m_lstColeta->viewport()->installEventFilter(this);

  m_ckEnterTab->setObjectName(QStringLiteral("ckEnterTab"));
  m_ckBackColor->setObjectName(QStringLiteral("ckBackColor"));
  auto* lblEnterTab = new ToggleLabel(QString::fromUtf16(kEnterTabLabel), m_ckEnterTab, this);
  lblEnterTab->setObjectName(QStringLiteral("lblEnterTab"));
  auto* lblBackColor = new ToggleLabel(QString::fromUtf16(kBackColorLabel), m_ckBackColor, this);
  lblBackColor->setObjectName(QStringLiteral("lblBackColor"));
  m_txtCor->setObjectName(QStringLiteral("txtCor"));
  m_txtCor->setValidator(new UpperCaseValidator(m_txtCor));
  m_txtCor->setMaximumWidth(110);
  m_cmdCor->setObjectName(QStringLiteral("cmdCor"));
  m_cmdCor->setFixedWidth(m_cmdCor->fontMetrics().horizontalAdvance(QStringLiteral("....")) + 16);
  m_cmdOK->setObjectName(QStringLiteral("cmdOK"));
  m_cmdCancel->setObjectName(QStringLiteral("cmdCancel"));
  for (QObject* field : {static_cast<QObject*>(m_ckEnterTab), static_cast<QObject*>(m_ckBackColor),
                         static_cast<QObject*>(m_txtCor)})
    field->installEventFilter(this);

  auto* enterTab = new QHBoxLayout;
  enterTab->addWidget(m_ckEnterTab);
  enterTab->addWidget(lblEnterTab, 1);
  auto* backColor = new QHBoxLayout;
  backColor->addWidget(m_ckBackColor);
  backColor->addWidget(lblBackColor);
  backColor->addWidget(m_txtCor);
  backColor->addWidget(m_cmdCor);
  backColor->addStretch(1);
  auto* buttons = new QHBoxLayout;
  buttons->addStretch(1);
  buttons->addWidget(m_cmdOK);
  buttons->addWidget(m_cmdCancel);
  auto* layout = new QVBoxLayout(this);
  layout->addLayout(rows);
  layout->addSpacing(6);
  layout->addLayout(enterTab);
  layout->addLayout(backColor);
  layout->addSpacing(6);
  layout->addLayout(buttons);
  setMinimumWidth(360);

  connect(m_cmdSeta, &QToolButton::clicked, this, [this] { cmdSeta_Click(); });
  connect(m_lstColeta, &QListWidget::currentRowChanged, this, [this](int item) { lstColeta_Click(item); });
  connect(m_ckEnterTab, &QCheckBox::toggled, this, [this](bool on) { m_enterAsTab = on; });
  connect(m_ckBackColor, &QCheckBox::toggled, this, [this](bool on) { m_backColorOnFocus = on; });
  connect(m_cmdCor, &QPushButton::clicked, this, [this] { cmdCor_Click(); });
  connect(m_cmdOK, &QPushButton::clicked, this, [this] { cmdOk_Click(); });
  connect(m_cmdCancel, &QPushButton::clicked, this, &QDialog::reject);
}

void frmProps::report(const std::exception& failure, const char* procedure, int line) {
  common::recordError(failure, kModule, QString::fromLatin1(procedure), line);
  common::ShowErrorReport(m_ui);
}

int frmProps::rowOf(QObject* box) const {
  for (int i = 0; i < kRows; ++i)
    if (m_txtValor[size_t(i)] == box) return i;
  return -1;
}

bool frmProps::isListRow(int row) const {
  return row >= 0 && row < m_properties.Count() && m_properties.Item(row + 1).PropertyType == kChooseFromList;
}

// ---------------------------------------------------------------------------------------------------
// Activation

void frmProps::showEvent(QShowEvent* event) {
  QDialog::showEvent(event);
  if (m_built) return;
  m_built = true;
  Form_Activate();
}

void frmProps::Form_Activate() {
  try {
    m_properties = CriarPropriedades(*m_control);
  } catch (const std::exception& failure) {
    report(failure, "Form_Activate", __LINE__);
  }
  const int count = std::min(m_properties.Count(), int(kRows));
  for (int i = 0; i < kRows; ++i) {
    const bool used = i < count;
    m_lblProp[size_t(i)]->setVisible(used);
    m_txtValor[size_t(i)]->setVisible(used);
    if (!used) continue;
    const CVBCTProperty& row = m_properties.Item(i + 1);
    m_lblProp[size_t(i)]->setText(row.PropertyName);
    m_txtValor[size_t(i)]->setText(row.shownText());
    // A list row takes its value from the list only.
    m_txtValor[size_t(i)]->setReadOnly(row.PropertyType == kChooseFromList);
  }
  m_enterAsTab = false;
  m_ckEnterTab->setChecked(false);
  if (count > 0) m_txtValor[0]->setFocus();
  m_focusColor = m_options.ColorOnFocus;
  m_txtCor->setText(m_focusColor);
  adjustSize();
}

// ---------------------------------------------------------------------------------------------------
// The rows

bool frmProps::eventFilter(QObject* watched, QEvent* event) {
  if (const int row = rowOf(watched); row >= 0) {
    switch (event->type()) {
      case QEvent::FocusIn:
        if (!isWindowFocusChange(event)) txtValor_GotFocus(row);
        break;
      case QEvent::FocusOut:
        if (!isWindowFocusChange(event)) txtValor_LostFocus(row);
        break;
      case QEvent::KeyPress:
        if (isEnter(event)) {
          focusNextChild();  // Enter moves on as Tab does
          return true;
        }
        if (static_cast<QKeyEvent*>(event)->key() == Qt::Key_Down && m_cmdSeta->isVisible() &&
            m_listRow == row) {
          m_arrowKey = true;
          cmdSeta_Click();
          m_arrowKey = false;
          return true;
        }
        break;
      default:
        break;
    }
    return QDialog::eventFilter(watched, event);
  }
  if (watched == m_ckEnterTab || watched == m_ckBackColor || watched == m_txtCor) {
    if (isEnter(event)) {
      focusNextChild();
      return true;
    }
    if (watched == m_txtCor && event->type() == QEvent::FocusIn) setBase(m_txtCor, QColor(255, 255, 0));
    if (watched == m_txtCor && event->type() == QEvent::FocusOut) setBase(m_txtCor, Qt::white);
  } else if (watched == m_lstColeta && event->type() == QEvent::KeyPress) {
    const int key = static_cast<QKeyEvent*>(event)->key();
    if (isEnter(event) || key == Qt::Key_Escape) {
      closeList();
      return true;
    }
  } else if (watched == m_lstColeta->viewport() && event->type() == QEvent::MouseButtonRelease) {
    // After the list has taken the click.
    QMetaObject::invokeMethod(
        this, [this] { closeList(); }, Qt::QueuedConnection);
  }
  return QDialog::eventFilter(watched, event);
}

void frmProps::EncheLista(const CVBCTProperty& row) {
  try {
    m_filling = true;
    m_lstColeta->clear();
    for (const CPropValue& value : row.Values) {
      auto* item = new QListWidgetItem(value.ValueName, m_lstColeta);
      item->setData(Qt::UserRole, QVariant::fromValue(value.Value.value<qint32>()));
    }
    m_filling = false;
  } catch (const std::exception& failure) {
    m_filling = false;
    report(failure, "EncheLista", __LINE__);
  }
}

void frmProps::txtValor_GotFocus(int row) {
  if (m_arrowKey) return;
  try {
    m_editingRow = row;
    m_lstColeta->hide();
    m_cmdSeta->hide();
    m_listRow = -1;
    if (!isListRow(row)) return;
    const CVBCTProperty& property = m_properties.Item(row + 1);
    EncheLista(property);
    QLineEdit* box = m_txtValor[size_t(row)];
    const QRect frame = box->geometry();
    const int items = std::min(m_lstColeta->count(), kVisibleListItems);
    const int itemHeight =
        m_lstColeta->sizeHintForRow(0) > 0 ? m_lstColeta->sizeHintForRow(0) : frame.height();
    m_lstColeta->setGeometry(frame.left(), frame.bottom() + 1, frame.width(),
                             items * itemHeight + 2 * m_lstColeta->frameWidth());
    m_filling = true;
    const QList<QListWidgetItem*> same =
        m_lstColeta->findItems(box->text(), Qt::MatchExactly | Qt::MatchCaseSensitive);
    m_lstColeta->setCurrentItem(same.isEmpty() ? nullptr : same.front());
    m_filling = false;
    m_cmdSeta->setGeometry(frame.right() - frame.height() + 2, frame.top() + 1, frame.height() - 2,
                           frame.height() - 2);
    m_cmdSeta->setProperty("row", row);
    m_cmdSeta->show();
    m_cmdSeta->raise();
    m_listRow = row;
  } catch (const std::exception& failure) {
    m_filling = false;
    report(failure, "txtValor_GotFocus", __LINE__);
  }
}

void frmProps::txtValor_LostFocus(int row) {
  if (m_arrowKey) return;
  if (m_editingRow == row) {
    m_editingRow = -1;
    if (!isListRow(row) && !commitRow(row)) {
      QLineEdit* box = m_txtValor[size_t(row)];
      QMetaObject::invokeMethod(
          this,
          [box] {
            box->setFocus();
            box->selectAll();
          },
          Qt::QueuedConnection);
    }
  }
  QWidget* next = QApplication::focusWidget();
  if (next != m_lstColeta && next != m_cmdSeta) {
    m_lstColeta->hide();
    m_cmdSeta->hide();
    m_listRow = -1;
  }
}

bool frmProps::commitRow(int row) {
  CVBCTProperty& property = m_properties.Item(row + 1);
  QLineEdit* box = m_txtValor[size_t(row)];
  const QString text = box->text().trimmed();
  box->setText(text);
  const CPropValue before = property.SelectedValue;
  const auto refuse = [&](const std::exception& failure) {
    property.SelectedValue = before;
    box->setText(property.shownText());
    report(failure, "txtValor_LostFocus", __LINE__);
    return false;
  };
  try {
    if (!text.isEmpty()) {
      const QVariant current = m_control->Properties()->Item(property.PropertyName)->Value();
      property.SelectedValue = {text, ToValueType(text, current)};
    } else {
      property.SelectedValue = property.DefaultValue.value_or(CPropValue{});
    }
  } catch (const std::exception& failure) {
    return refuse(inDialogLanguage(failure, property.PropertyName, text));
  }
  try {
    if (!isIdentity(property)) {
      writeRow(property);
    } else {
      try {
        writeIdentity();
      } catch (const ide::Error& error) {
        // A name in use waits for OK: the other of the two boxes may be about to make the control an
        // element of that control array.
        if (error.number() != ide::err::NameConflict) throw;
      }
    }
    return true;
  } catch (const std::exception& failure) {
    return refuse(failure);
  }
}

void frmProps::writeRow(const CVBCTProperty& row) {
  // A row whose property could not be read holds nothing to write.
  const QVariant value = valueToWrite(row);
  if (!value.isValid()) return;
  try {
    writeProperty(row.PropertyName, value);
  } catch (const std::exception& failure) {
    throw inDialogLanguage(failure, row.PropertyName, row.shownText());
  }
}

void frmProps::writeIdentity() {
  const QString name = QStringLiteral("Name");
  const QString index = QStringLiteral("Index");
  if (!m_properties.contains(name) || !m_properties.contains(index)) {
    for (const auto& row : m_properties)
      if (isIdentity(*row)) writeRow(*row);
    return;
  }
  const QVariant newName = valueToWrite(m_properties.Item(name));
  const QVariant newIndex = valueToWrite(m_properties.Item(index));
  const auto properties = m_control->Properties();
  const QVariant oldName = properties->Item(name)->Value();
  const QVariant oldIndex = properties->Item(index)->Value();
  QString failing = index;
  try {
    // Index first: the control becomes an element of an array under its old name, then takes the
    // array's name, which Name first would find in use. Name first when the new index is one the old
    // name's array has already.
    bool indexWritten = true;
    try {
      writeProperty(index, newIndex);
    } catch (const ide::Error& error) {
      if (error.number() != ide::err::NameConflict) throw;
      indexWritten = false;
    }
    failing = name;
    writeProperty(name, newName);
    failing = index;
    if (!indexWritten) writeProperty(index, newIndex);
  } catch (const std::exception& failure) {
    // Half written is neither what the control was nor what was asked: back to what it was.
    for (const auto& [property, value] : {std::pair(index, oldIndex), std::pair(name, oldName)}) {
      try {
        writeProperty(property, value);
      } catch (const std::exception& restoring) {
        common::logFailure(restoring, kModule, QStringLiteral("writeIdentity"), __LINE__);
      }
    }
    const auto* error = dynamic_cast<const ide::Error*>(&failure);
    if (error && error->number() == ide::err::NameConflict) {
      const int element = newIndex.toInt();
      throw inDialogLanguage(
          failure, name,
          valueText(newName) + (element >= 0 ? QStringLiteral("(%1)").arg(element) : QString()));
    }
    throw inDialogLanguage(failure, failing, m_properties.Item(failing).shownText());
  }
}

void frmProps::writeProperty(const QString& name, const QVariant& value) {
  const auto property = m_control->Properties()->Item(name);
  // A value the control holds already is not written again: the form would record a default it leaves out.
  try {
    if (const QVariant current = property->Value(); current.isValid() && sameValue(current, value)) return;
  } catch (const std::exception& failure) {
    // A value that cannot be read is written all the same.
    common::logFailure(failure, kModule, QStringLiteral("writeProperty"), __LINE__);
  }
  property->setValue(value);
}

void frmProps::cmdSeta_Click() {
  if (m_listRow < 0) return;
  m_lstColeta->show();
  m_lstColeta->raise();
  m_lstColeta->setFocus();
}

void frmProps::lstColeta_Click(int item) {
  if (m_filling || m_listRow < 0 || item < 0) return;
  try {
    CVBCTProperty& property = m_properties.Item(m_listRow + 1);
    const QListWidgetItem* entry = m_lstColeta->item(item);
    m_txtValor[size_t(m_listRow)]->setText(entry->text());
    property.SelectedValue = {entry->text(), QVariant::fromValue(entry->data(Qt::UserRole).value<qint32>())};
  } catch (const std::exception& failure) {
    report(failure, "lstColeta_Click", __LINE__);
  }
}

void frmProps::closeList() {
  m_lstColeta->hide();
  if (m_listRow >= 0) m_txtValor[size_t(m_listRow)]->setFocus();
}

// ---------------------------------------------------------------------------------------------------
// Colour, OK and Cancel

void frmProps::cmdCor_Click() {
  // Cancelling the colour dialog changes nothing.
  if (const std::optional<QColor> chosen = m_chooseColour(this, colourOf(m_txtCor->text()))) {
    m_txtCor->setText(colourLiteral(*chosen));
    m_txtCor->setFocus();
  }
}

void frmProps::cmdOk_Click() {
  try {
    // The box still being edited is left first, and so is any other free-text box whose text is not its
    // row's value (text put there without the box having had the focus): nothing typed is lost.
    m_editingRow = -1;
    for (int row = 0; row < std::min(m_properties.Count(), int(kRows)); ++row) {
      if (isListRow(row)) continue;
      if (m_txtValor[size_t(row)]->text().trimmed() == m_properties.Item(row + 1).shownText()) continue;
      if (!commitRow(row)) {
        m_txtValor[size_t(row)]->setFocus();
        return;
      }
    }
    m_cmdOK->setFocus();
    const QString colour = m_txtCor->text().trimmed();
    if (!isColourText(colour)) {
      m_ui.MsgBox(QString::fromUtf16(kPropsColourNotNumeric), ide::mb::OKOnly, common::title());
      m_txtCor->setFocus();
      m_txtCor->selectAll();
      return;
    }
    if (!colour.isEmpty()) m_focusColor = colour;  // an empty box keeps the previous colour
    try {
      writeIdentity();
    } catch (const std::exception& failure) {
      report(failure, "cmdOk_Click", __LINE__);
      m_txtValor[0]->setFocus();  // the Name row
      return;
    }
    for (const auto& row : m_properties)
      if (!isIdentity(*row)) writeRow(*row);
    accept();
  } catch (const std::exception& failure) {
    report(failure, "cmdOk_Click", __LINE__);
  }
}

void frmProps::done(int result) {
  if (result != QDialog::Accepted) m_cancelled = true;
  QDialog::done(result);
}

}  // namespace designer
