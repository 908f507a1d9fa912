// SPDX-License-Identifier: MIT
#include "propertiesview.h"

#include "host/files/controlclasses.h"
#include "host/files/frxfile.h"
#include "qtplatform.h"

#include <QComboBox>
#include <QHeaderView>
#include <QLabel>
#include <QStyledItemDelegate>
#include <QTabBar>
#include <QTableWidget>
#include <QVBoxLayout>

#include <functional>
#include <map>

namespace desktop {
namespace {

enum Role { PropertyRole = Qt::UserRole + 1, ChoicesRole };

QString bareClass(const QString& className) {
  const qsizetype dot = className.indexOf(u'.');
  return dot < 0 ? className : className.sliced(dot + 1);
}

/// Where the window files a property and what its pane says about it.
struct PropertyText {
  const char* name;
  const char* category;
  const char* description;
};

const PropertyText kPropertyTexts[] = {
    {"Alignment", "Misc", "How the text is aligned: left, right or centred."},
    {"Appearance", "Appearance", "Whether the object is drawn flat or with a 3-D border."},
    {"AutoRedraw", "Behavior", "Whether drawing is kept in a picture that repaints the object."},
    {"AutoSize", "Behavior", "Whether the object sizes itself to its contents."},
    {"BackColor", "Appearance", "The colour behind the object's text and graphics."},
    {"BackStyle", "Appearance", "Whether the background is opaque or lets what lies below show through."},
    {"BorderColor", "Appearance", "The colour of the border."},
    {"BorderStyle", "Appearance", "The kind of border the object has."},
    {"BorderWidth", "Appearance", "The width of the border, in pixels."},
    {"Cancel", "Misc", "Whether the button is chosen by the Esc key."},
    {"Caption", "Appearance", "The text in the title bar, or on the object."},
    {"ClipControls", "Behavior", "Whether painting is clipped to leave out the controls the object holds."},
    {"ControlBox", "Behavior", "Whether the window has its control menu and Close button."},
    {"Default", "Misc", "Whether the button is chosen by the Enter key."},
    {"DrawMode", "Appearance", "How graphics methods combine their ink with what is drawn already."},
    {"Enabled", "Behavior", "Whether the object answers to the user."},
    {"Font", "Font", "The font of the object's text."},
    {"ForeColor", "Appearance", "The colour of the object's text and graphics."},
    {"Height", "Position", "The height of the object."},
    {"HelpContextID", "Misc", "The help topic shown for the object."},
    {"Icon", "Misc", "The picture shown for the window when it is minimized."},
    {"Index", "Misc", "The object's number in a control array; empty for a single control."},
    {"Interval", "Behavior", "The time between two Timer events, in milliseconds."},
    {"KeyPreview", "Misc", "Whether the form sees key presses before its controls."},
    {"Left", "Position", "The distance between the object and the left edge of its container."},
    {"List", "List", "The items of the list."},
    {"Locked", "Behavior", "Whether the text can be read but not changed."},
    {"MaxButton", "Behavior", "Whether the window has a Maximize button."},
    {"MaxLength", "Behavior", "The most characters the box takes; 0 for no limit."},
    {"MinButton", "Behavior", "Whether the window has a Minimize button."},
    {"MousePointer", "Misc", "The mouse pointer shown over the object."},
    {"MultiLine", "Behavior", "Whether the box holds several lines of text."},
    {"Name", "Misc", "The name code uses for the object."},
    {"PasswordChar", "Behavior", "The character shown in place of each character typed."},
    {"Picture", "Appearance", "The picture the object shows."},
    {"ScaleHeight", "Scale", "The height of the inside of the object, in its own units."},
    {"ScaleMode", "Scale", "The unit of the object's coordinates."},
    {"ScaleWidth", "Scale", "The width of the inside of the object, in its own units."},
    {"ScrollBars", "Appearance", "Which scroll bars the object has."},
    {"ShowInTaskbar", "Misc", "Whether the window has a button on the taskbar."},
    {"Sorted", "Behavior", "Whether the items are kept in alphabetical order."},
    {"StartUpPosition", "Position", "Where the window first appears."},
    {"Stretch", "Behavior", "Whether the picture is resized to the object's size."},
    {"Style", "Appearance", "The look and behaviour of the object."},
    {"TabIndex", "Behavior", "The object's place in the order the Tab key follows."},
    {"TabStop", "Behavior", "Whether the Tab key stops at the object."},
    {"Tag", "Misc", "Any text the program keeps with the object."},
    {"Text", "Text", "The text the box holds."},
    {"ToolTipText", "Misc", "The text shown when the mouse rests on the object."},
    {"Top", "Position", "The distance between the object and the top edge of its container."},
    {"Value", "Misc", "The state or value of the control."},
    {"Visible", "Behavior", "Whether the object is shown."},
    {"WhatsThisHelpID", "Misc", "The help topic of the What's This pop-up."},
    {"Width", "Position", "The width of the object."},
    {"WindowState", "Position", "Whether the window opens normal, minimized or maximized."},
    {"WordWrap", "Behavior", "Whether the caption breaks into lines within the width."},
};

const PropertyText* propertyText(const QString& name) {
  for (const PropertyText& text : kPropertyTexts)
    if (name.compare(QLatin1StringView(text.name), Qt::CaseInsensitive) == 0) return &text;
  return nullptr;
}

/// "Text1(0) TextBox": how the object box names a control.
QString objectLabel(host::ControlImpl& control) {
  const QVariant index =
      control.hasProperty(QStringLiteral("Index")) ? control.property(QStringLiteral("Index")) : QVariant();
  QString name = control.name();
  if (index.isValid() && index.toInt() >= 0) name += QStringLiteral("(%1)").arg(index.toInt());
  return name + u' ' + bareClass(control.node() ? control.node()->className() : QString());
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
  m_objects = new QComboBox(this);
  m_objects->setObjectName(QStringLiteral("propertiesObject"));
  m_tabs = new QTabBar(this);
  m_tabs->setObjectName(QStringLiteral("propertiesTabs"));
  m_tabs->addTab(QStringLiteral("Alphabetic"));
  m_tabs->addTab(QStringLiteral("Categorized"));
  m_tabs->setExpanding(false);
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
  m_description = new QLabel(this);
  m_description->setObjectName(QStringLiteral("propertiesDescription"));
  m_description->setFrameShape(QFrame::Panel);
  m_description->setFrameShadow(QFrame::Sunken);
  m_description->setWordWrap(true);
  m_description->setAlignment(Qt::AlignLeft | Qt::AlignTop);
  m_description->setContentsMargins(3, 2, 3, 2);
  m_description->setFixedHeight(m_description->fontMetrics().lineSpacing() * 3 + 8);
  auto* layout = new QVBoxLayout(this);
  layout->setContentsMargins(0, 0, 0, 0);
  layout->setSpacing(2);
  layout->addWidget(m_objects);
  layout->addWidget(m_tabs);
  layout->addWidget(m_table, 1);
  layout->addWidget(m_description);
  connect(m_tabs, &QTabBar::currentChanged, this, [this](int tab) { setCategorized(tab == 1); });
  connect(m_table, &QTableWidget::currentCellChanged, this, [this] { describeCurrent(); });
  connect(m_objects, &QComboBox::activated, this, [this](int index) {
    auto* control = reinterpret_cast<host::ControlImpl*>(m_objects->itemData(index).value<quintptr>());
    if (!control || control == m_control.get()) return;
    Q_EMIT objectChosen(control->shared_from_this());
  });
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

QString PropertiesView::categoryOf(const QString& property) {
  const PropertyText* text = propertyText(property);
  return text ? QString::fromLatin1(text->category) : QStringLiteral("Misc");
}

void PropertiesView::setCategorized(bool categorized) {
  if (categorized == m_categorized) return;
  m_categorized = categorized;
  const QSignalBlocker block(m_tabs);
  m_tabs->setCurrentIndex(categorized ? 1 : 0);
  rebuild();
}

void PropertiesView::fillObjects() {
  m_objects->clear();
  if (m_component) {
    m_objects->addItem(m_component->Name() + QStringLiteral(" Module"));
    return;
  }
  if (!m_control || !m_control->node()) return;
  auto form = m_control->form();
  if (!form) return;
  // The form first, then its controls by name, as the IDE lists them.
  auto root = std::static_pointer_cast<host::ControlImpl>(form->Root());
  std::vector<std::shared_ptr<host::ControlImpl>> controls;
  std::function<void(host::FormNode*)> collect = [&](host::FormNode* node) {
    for (host::FormNode* child : node->children()) {
      if (bareClass(child->className()) == QLatin1StringView("Menu")) continue;
      if (auto control = form->control(child)) controls.push_back(control);
      collect(child);
    }
  };
  collect(&form->description().root());
  std::sort(controls.begin(), controls.end(), [](const auto& a, const auto& b) {
    return objectLabel(*a).compare(objectLabel(*b), Qt::CaseInsensitive) < 0;
  });
  controls.insert(controls.begin(), root);
  for (const auto& control : controls) {
    m_objects->addItem(objectLabel(*control),
                       QVariant::fromValue<quintptr>(reinterpret_cast<quintptr>(control.get())));
    if (control == m_control) m_objects->setCurrentIndex(m_objects->count() - 1);
  }
}

void PropertiesView::rebuild() {
  m_filling = true;
  m_table->clearSpans();
  m_table->setRowCount(0);
  QStringList names;
  QString className;
  if (m_control && m_control->node()) {
    className = m_control->node()->className();
    names = m_control->propertyNames();
  } else if (m_component) {
    names = {QStringLiteral("Name")};
  }
  fillObjects();
  // Alphabetical, with (Name) on top, as the IDE lists them; by category, each category's rows under it.
  const auto byName = [](const QString& a, const QString& b) {
    return a.compare(b, Qt::CaseInsensitive) < 0;
  };
  names.removeAll(QStringLiteral("Name"));
  std::sort(names.begin(), names.end(), byName);
  if (m_control || m_component) names.prepend(QStringLiteral("Name"));
  QList<QString> rows;  // property names; a category row is its name after a NUL
  if (m_categorized) {
    std::map<QString, QStringList> categories;
    for (const QString& name : names)
      categories[categoryOf(name)] << name;
    for (auto& [category, members] : categories) {
      rows << QChar(0) + category;
      std::sort(members.begin(), members.end(), byName);
      rows << members;
    }
  } else {
    rows = names;
  }
  m_table->setRowCount(static_cast<int>(rows.size()));
  for (int row = 0; row < rows.size(); ++row) {
    const QString& name = rows[row];
    if (name.startsWith(QChar(0))) {
      auto* header = new QTableWidgetItem(name.mid(1));
      QFont bold = header->font();
      bold.setBold(true);
      header->setFont(bold);
      header->setFlags(Qt::ItemIsEnabled);
      header->setBackground(palette().button());
      m_table->setItem(row, 0, header);
      auto* empty = new QTableWidgetItem;
      empty->setFlags(Qt::ItemIsEnabled);
      m_table->setItem(row, 1, empty);
      m_table->setSpan(row, 0, 1, 2);
      continue;
    }
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
  describeCurrent();
}

void PropertiesView::describeCurrent() {
  const QTableWidgetItem* item =
      m_table->currentRow() >= 0 ? m_table->item(m_table->currentRow(), 1) : nullptr;
  const QString name = item ? item->data(PropertyRole).toString() : QString();
  if (name.isEmpty()) {
    m_description->clear();
    return;
  }
  const PropertyText* text = propertyText(name);
  m_description->setText(QStringLiteral("<b>%1</b><br>%2")
                             .arg(name == QLatin1StringView("Name") ? QStringLiteral("(Name)") : name,
                                  text ? QString::fromLatin1(text->description).toHtmlEscaped() : QString()));
}

void PropertiesView::refreshValues() {
  if (m_control && m_control->node()) {
    const QString className = m_control->node()->className();
    if (m_objects->currentIndex() >= 0)
      m_objects->setItemText(m_objects->currentIndex(), objectLabel(*m_control));
    for (int row = 0; row < m_table->rowCount(); ++row) {
      QTableWidgetItem* item = m_table->item(row, 1);
      const QString name = item->data(PropertyRole).toString();
      if (name.isEmpty()) continue;  // a category
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
  } else if (m_component && m_table->rowCount() >= 1) {
    m_objects->setItemText(0, m_component->Name() + QStringLiteral(" Module"));
    for (int row = 0; row < m_table->rowCount(); ++row)
      if (m_table->item(row, 1)->data(PropertyRole).toString() == QLatin1StringView("Name"))
        m_table->item(row, 1)->setText(m_component->Name());
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
  for (int row = 0; row < m_table->rowCount(); ++row) {
    const QString name = m_table->item(row, 1)->data(PropertyRole).toString();
    if (!name.isEmpty() && name.compare(property, Qt::CaseInsensitive) == 0)
      return m_table->item(row, 1)->text();
  }
  return {};
}

}  // namespace desktop
