// SPDX-License-Identifier: MIT
#include "propertiesview.h"

#include "host/files/controlclasses.h"
#include "host/files/frxfile.h"
#include "qtplatform.h"

#include <QComboBox>
#include <QHeaderView>
#include <QLabel>
#include <QStyledItemDelegate>
#include <QTableWidget>
#include <QVBoxLayout>

namespace desktop {
namespace {

enum Role { PropertyRole = Qt::UserRole + 1, ChoicesRole };

QString bareClass(const QString& className) {
  const qsizetype dot = className.indexOf(u'.');
  return dot < 0 ? className : className.sliced(dot + 1);
}

/// The values an enumerated or Boolean property can take, as the grid shows them.
QStringList choicesOf(const host::PropertyInfo& info) {
  QStringList choices;
  if (info.type == host::PropertyType::Boolean) return {QStringLiteral("True"), QStringLiteral("False")};
  if (info.type == host::PropertyType::Enumerated)
    for (const host::EnumValue& value : info.valueNames)
      choices << QStringLiteral("%1 - %2").arg(value.value).arg(QString::fromLatin1(value.name));
  return choices;
}

/// Edits a row: a list for enumerations and Booleans, a line for the rest.
class ValueDelegate final : public QStyledItemDelegate {
 public:
  using QStyledItemDelegate::QStyledItemDelegate;
  std::function<void(const QString&, const QString&)> commit;

  QWidget* createEditor(QWidget* parent, const QStyleOptionViewItem& option,
                        const QModelIndex& index) const override {
    const QStringList choices = index.data(ChoicesRole).toStringList();
    if (choices.isEmpty()) return QStyledItemDelegate::createEditor(parent, option, index);
    auto* box = new QComboBox(parent);
    box->addItems(choices);
    return box;
  }
  void setEditorData(QWidget* editor, const QModelIndex& index) const override {
    if (auto* box = qobject_cast<QComboBox*>(editor)) {
      box->setCurrentIndex(std::max(0, box->findText(index.data(Qt::DisplayRole).toString())));
      return;
    }
    QStyledItemDelegate::setEditorData(editor, index);
  }
  void setModelData(QWidget* editor, QAbstractItemModel*, const QModelIndex& index) const override {
    QString text;
    if (auto* box = qobject_cast<QComboBox*>(editor))
      text = box->currentText();
    else
      text = editor->property("text").toString();
    // The model is not written directly: the view shows again what the control then holds.
    if (commit) commit(index.data(PropertyRole).toString(), text);
  }
};

}  // namespace

PropertiesView::PropertiesView(QWidget* parent) : QWidget(parent) {
  setObjectName(QStringLiteral("propertiesWindow"));
  m_title = new QLabel(this);
  m_title->setObjectName(QStringLiteral("propertiesTitle"));
  m_title->setFrameShape(QFrame::StyledPanel);
  m_title->setContentsMargins(4, 2, 4, 2);
  m_table = new QTableWidget(0, 2, this);
  m_table->setObjectName(QStringLiteral("propertiesGrid"));
  m_table->horizontalHeader()->hide();
  m_table->verticalHeader()->hide();
  m_table->horizontalHeader()->setSectionResizeMode(0, QHeaderView::Interactive);
  m_table->horizontalHeader()->setStretchLastSection(true);
  m_table->setColumnWidth(0, 120);
  m_table->verticalHeader()->setDefaultSectionSize(20);
  m_table->setSelectionBehavior(QAbstractItemView::SelectRows);
  m_table->setSelectionMode(QAbstractItemView::SingleSelection);
  m_table->setEditTriggers(QAbstractItemView::AllEditTriggers);
  auto* delegate = new ValueDelegate(m_table);
  delegate->commit = [this](const QString& property, const QString& text) { applyEdit(property, text); };
  m_table->setItemDelegateForColumn(1, delegate);
  auto* layout = new QVBoxLayout(this);
  layout->setContentsMargins(0, 0, 0, 0);
  layout->setSpacing(2);
  layout->addWidget(m_title);
  layout->addWidget(m_table);
}

PropertiesView::~PropertiesView() = default;

QString PropertiesView::displayText(const QVariant& value, const QString& className,
                                    const QString& property) {
  // A control that is no array element shows an empty Index, as the IDE shows it.
  if (property.compare(QLatin1StringView("Index"), Qt::CaseInsensitive) == 0 && value.toInt() < 0) return {};
  // Values of the binary file are named by their kind, as the IDE names them: "(Bitmap)", "(Icon)",
  // "(None)", "(List)".
  switch (host::frxRecordKind(className, property)) {
    case host::FrxRecordKind::Picture:
      if (value.typeId() == QMetaType::QByteArray)
        return QStringLiteral("(%1)").arg(host::pictureKind(value.toByteArray()));
      if (!value.isValid()) return QStringLiteral("(None)");
      break;
    case host::FrxRecordKind::List:
    case host::FrxRecordKind::ItemData:
      if (value.typeId() == QMetaType::QStringList || value.typeId() == QMetaType::QVariantList ||
          !value.isValid())
        return QStringLiteral("(List)");
      break;
    default:
      break;
  }
  const host::PropertyInfo info = host::propertyInfoOrUntyped(className, property);
  switch (info.type) {
    case host::PropertyType::Boolean:
      return value.toBool() ? QStringLiteral("True") : QStringLiteral("False");
    case host::PropertyType::Enumerated: {
      const qint32 number = value.toInt();
      const QString name = host::valueName(info, number);
      return name.isEmpty() ? QString::number(number) : QStringLiteral("%1 - %2").arg(number).arg(name);
    }
    case host::PropertyType::Color:
      return QStringLiteral("&H%1&")
          .arg(static_cast<quint32>(value.toInt()), 8, 16, QLatin1Char('0'))
          .toUpper();
    default:
      // A text of several lines shows on one, its line breaks as pilcrows.
      return value.toString().replace(QStringLiteral("\r\n"), QStringLiteral("¶"));
  }
}

void PropertiesView::showControl(const std::shared_ptr<host::ControlImpl>& control) {
  if (control == m_control && !m_component) return;
  m_control = control;
  m_component.reset();
  m_formChanged.disconnect();
  if (auto form = control ? control->form() : nullptr)
    m_formChanged = form->controlChanged.connect([this](host::ControlImpl*) {
      if (m_control && !m_control->node()) return clear();
      refreshValues();
    });
  rebuild();
}

void PropertiesView::showComponent(const std::shared_ptr<host::ComponentImpl>& component) {
  if (!component) return clear();
  if (auto form = component->form())
    return showControl(std::static_pointer_cast<host::ControlImpl>(form->Root()));
  if (component == m_component) return refreshValues();
  m_control.reset();
  m_formChanged.disconnect();
  m_component = component;
  rebuild();
}

void PropertiesView::clear() {
  m_control.reset();
  m_component.reset();
  m_formChanged.disconnect();
  rebuild();
}

void PropertiesView::rebuild() {
  m_filling = true;
  m_table->setRowCount(0);
  QString title;
  QStringList names;
  QString className;
  if (m_control && m_control->node()) {
    className = m_control->node()->className();
    title = m_control->name() + QStringLiteral("  ") + bareClass(className);
    names = m_control->propertyNames();
  } else if (m_component) {
    title = m_component->Name() + QStringLiteral("  Module");
    names = {QStringLiteral("Name")};
  }
  m_title->setText(title);
  // Alphabetical, with (Name) on top, as the IDE lists them.
  names.removeAll(QStringLiteral("Name"));
  std::sort(names.begin(), names.end(),
            [](const QString& a, const QString& b) { return a.compare(b, Qt::CaseInsensitive) < 0; });
  if (m_control || m_component) names.prepend(QStringLiteral("Name"));
  m_table->setRowCount(static_cast<int>(names.size()));
  for (int row = 0; row < names.size(); ++row) {
    const QString& name = names[row];
    auto* key = new QTableWidgetItem(name == QLatin1StringView("Name") ? QStringLiteral("(Name)") : name);
    key->setFlags(Qt::ItemIsEnabled | Qt::ItemIsSelectable);
    auto* value = new QTableWidgetItem;
    value->setData(PropertyRole, name);
    value->setData(ChoicesRole, choicesOf(host::propertyInfoOrUntyped(className, name)));
    // Pictures and lists are not typed in; their rows show what the binary file holds.
    const host::FrxRecordKind kind = host::frxRecordKind(className, name);
    if (kind == host::FrxRecordKind::Picture || kind == host::FrxRecordKind::List ||
        kind == host::FrxRecordKind::ItemData)
      value->setFlags(Qt::ItemIsEnabled | Qt::ItemIsSelectable);
    m_table->setItem(row, 0, key);
    m_table->setItem(row, 1, value);
  }
  m_filling = false;
  refreshValues();
}

void PropertiesView::refreshValues() {
  if (m_control && m_control->node()) {
    const QString className = m_control->node()->className();
    m_title->setText(m_control->name() + QStringLiteral("  ") + bareClass(className));
    for (int row = 0; row < m_table->rowCount(); ++row) {
      QTableWidgetItem* item = m_table->item(row, 1);
      const QString name = item->data(PropertyRole).toString();
      QString text;
      try {
        // The Font row names the font, its own or its container's.
        text = name.compare(QLatin1StringView("Font"), Qt::CaseInsensitive) == 0
                   ? m_control->font().name
                   : displayText(m_control->property(name), className, name);
      } catch (const ide::Error& error) {
        // Shown empty, as the IDE shows a value it cannot read.
        qCDebug(lcIde) << "cannot read" << name << "of a" << className << ":" << error.description();
      }
      item->setText(text);
    }
  } else if (m_component && m_table->rowCount() == 1) {
    m_title->setText(m_component->Name() + QStringLiteral("  Module"));
    m_table->item(0, 1)->setText(m_component->Name());
  }
}

bool PropertiesView::applyEdit(const QString& property, const QString& text) {
  if (m_filling) return false;
  try {
    if (m_component) {
      if (property.compare(QLatin1StringView("Name"), Qt::CaseInsensitive) != 0) return false;
      m_component->setName(text.trimmed());
    } else if (m_control && m_control->node()) {
      const host::PropertyInfo info = host::propertyInfoOrUntyped(m_control->node()->className(), property);
      QVariant value = text;
      if (info.type == host::PropertyType::String)
        value = QString(text).replace(u'¶', QStringLiteral("\r\n"));
      if (property.compare(QLatin1StringView("Index"), Qt::CaseInsensitive) == 0 &&
          text.trimmed().isEmpty()) {
        value = -1;  // emptied: no longer an array element
      } else if (info.type == host::PropertyType::Enumerated) {
        // "2 - CenterScreen" sets 2.
        bool ok = false;
        const int number = text.section(u'-', 0, 0).trimmed().toInt(&ok);
        if (ok) value = number;
      } else if (info.type == host::PropertyType::Color &&
                 text.trimmed().startsWith(QLatin1StringView("&H"), Qt::CaseInsensitive)) {
        QString hex = text.trimmed().mid(2);
        if (hex.endsWith(u'&')) hex.chop(1);
        bool ok = false;
        const quint32 number = hex.toUInt(&ok, 16);
        if (ok) value = static_cast<qint32>(number);
      }
      m_control->setProperty(property, value);
    } else {
      return false;
    }
  } catch (const ide::Error& error) {
    if (m_report) m_report(QStringLiteral("%1: %2").arg(property, error.description()));
    refreshValues();
    return false;
  }
  refreshValues();
  return true;
}

QString PropertiesView::shownValue(const QString& property) const {
  for (int row = 0; row < m_table->rowCount(); ++row)
    if (m_table->item(row, 1)->data(PropertyRole).toString().compare(property, Qt::CaseInsensitive) == 0)
      return m_table->item(row, 1)->text();
  return {};
}

}  // namespace desktop
