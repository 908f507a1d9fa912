// SPDX-License-Identifier: MIT
#include "designer/properties.h"

#include "common/errors.h"
#include "designer/values.h"

#include <array>

namespace designer {
namespace {

constexpr long kDuplicateKey = 457;
const QString kModule = QStringLiteral("frmProps");

// clang-format off
constexpr ListItem kBoolean[] = {{"False", 0}, {"True", -1}};
constexpr ListItem kScrollBars[] = {{"0 - None", 0}, {"1 - Horizontal", 1}, {"2 - Vertical", 2}, {"3 - Both", 3}};
constexpr ListItem kAlignment[] = {{"0 - Left Justify", 0}, {"1 - Right Justify", 1}, {"2 - Center", 2}};
constexpr ListItem kComboStyle[] = {{"0 - Dropdown Combo", 0}, {"1 - Simple Combo", 1}, {"2 - Dropdown List", 2}};
constexpr ListItem kListStyle[] = {{"0 - Standard", 0}, {"1 - Checkbox", 1}};
constexpr ListItem kButtonStyle[] = {{"0 - Standard", 0}, {"1 - Graphical", 1}};
constexpr ListItem kListViewView[] = {{"0 - lvwIcon", 0}, {"1 - lvwSmallIcon", 1}, {"2 - lvwList", 2}, {"3 - lvwReport", 3}};
constexpr ListItem kLabelEdit[] = {{"0 - lvwAutomatic", 0}, {"1 - lvwManual", 1}};
// clang-format on

/// A row of the class table: a list row (list 1 to 8), or a free-text row whose default is a number
/// (converted to the property's type) or, without one, the empty text.
struct RowSpec {
  const char* property;
  int list = 0;
  const char* numericDefault = nullptr;
};

constexpr RowSpec kTextBox[] = {
    {"Locked", 1}, {"MaxLength", 0, "0"}, {"Multiline", 1}, {"ScrollBars", 2}, {"ToolTipText"}};
constexpr RowSpec kCommandButton[] = {
    {"Caption"}, {"Cancel", 1}, {"Default", 1}, {"Enabled", 1}, {"ToolTipText"}};
constexpr RowSpec kLabel[] = {{"Caption"}, {"Alignment", 3}, {"WordWrap", 1}, {"Visible", 1}};
constexpr RowSpec kComboBox[] = {{"Style", 4}, {"Sorted", 1}, {"ToolTipText"}};
constexpr RowSpec kListBox[] = {{"Style", 5}, {"Sorted", 1}, {"ToolTipText"}};
constexpr RowSpec kFrame[] = {{"Caption"}};
constexpr RowSpec kTimer[] = {{"Interval", 0, "0"}};
constexpr RowSpec kCheckBox[] = {{"Caption"}, {"Alignment", 3}, {"Style", 6}, {"ToolTipText"}};
constexpr RowSpec kToolTipOnly[] = {{"ToolTipText"}};
constexpr RowSpec kListView[] = {{"View", 7}, {"LabelEdit", 8}};

struct ClassRows {
  const char* className;
  std::span<const RowSpec> rows;
};

constexpr ClassRows kClasses[] = {
    {"TextBox", kTextBox},       {"CommandButton", kCommandButton},
    {"Label", kLabel},           {"ComboBox", kComboBox},
    {"ListBox", kListBox},       {"Frame", kFrame},
    {"Timer", kTimer},           {"CheckBox", kCheckBox},
    {"OptionButton", kCheckBox}, {"PictureBox", kToolTipOnly},
    {"Image", kToolTipOnly},     {"ListView", kListView},
};

/// The properties a class outside the table offers, when the control has them.
constexpr std::array<const char*, 5> kCommonProperties = {"caption", "sorted", "enabled", "locked",
                                                          "tooltiptext"};
constexpr std::array<const char*, 3> kCommonListProperties = {"sorted", "enabled", "locked"};

template <size_t N>
bool isOneOf(const QString& lowerName, const std::array<const char*, N>& names) {
  for (const char* name : names)
    if (lowerName == QLatin1StringView(name)) return true;
  return false;
}

/// The control's current value of a property; empty when it cannot be read.
QVariant currentValue(ide::VBControl& control, const QString& name) {
  try {
    return control.Properties()->Item(name)->Value();
  } catch (const std::exception&) {
    return {};
  }
}

/// A numeric default in the type of the property's current value (the text itself when that fails).
CPropValue numericDefault(const QString& text, const QVariant& current) {
  try {
    return {text, ToValueType(text, current)};
  } catch (const std::exception& failure) {
    common::logFailure(failure, QStringLiteral("CVBCTProperty"), QStringLiteral("DefaultValue"), __LINE__);
    return {text, text};
  }
}

}  // namespace

// ---------------------------------------------------------------------------------------------------

const CPropValue* CVBCTProperty::value(const QString& valueName) const {
  for (const CPropValue& item : Values)
    if (item.ValueName.compare(valueName, Qt::CaseInsensitive) == 0) return &item;
  return nullptr;
}

QString CVBCTProperty::shownText() const {
  if (PropertyName.compare(QLatin1StringView("Index"), Qt::CaseInsensitive) == 0) {
    const std::optional<double> index = vbNumber(valueText(SelectedValue.Value));
    if (!index || *index == -1) return {};
    return QString::number(qint64(*index));
  }
  return SelectedValue.ValueName;
}

CVBCTProperties::Items::const_iterator CVBCTProperties::find(const QString& key) const {
  for (size_t i = 0; i < m_keys.size(); ++i)
    if (m_keys[i].compare(key, Qt::CaseInsensitive) == 0) return m_items.begin() + qsizetype(i);
  return m_items.end();
}

bool CVBCTProperties::contains(const QString& key) const {
  return find(key) != m_items.end();
}

CVBCTProperty& CVBCTProperties::Add(CVBCTProperty property, const QString& key) {
  if (contains(key))
    ide::raise(kDuplicateKey,
               QStringLiteral("This key is already associated with an element of this collection"));
  m_items.push_back(std::make_shared<CVBCTProperty>(std::move(property)));
  m_keys.push_back(key);
  return *m_items.back();
}

CVBCTProperty& CVBCTProperties::Item(int index) const {
  if (index < 1 || index > Count()) ide::raise(ide::err::SubscriptOutOfRange);
  return *m_items[size_t(index - 1)];
}

CVBCTProperty& CVBCTProperties::Item(const QString& key) const {
  const auto found = find(key);
  if (found == m_items.end()) ide::raise(ide::err::InvalidProcedureCall);
  return **found;
}

void CVBCTProperties::Remove(const QString& key) {
  const auto found = find(key);
  if (found == m_items.end()) ide::raise(ide::err::InvalidProcedureCall);
  const auto offset = found - m_items.begin();
  m_items.erase(m_items.begin() + offset);
  m_keys.erase(m_keys.begin() + offset);
}

void CVBCTProperties::Clear() {
  m_items.clear();
  m_keys.clear();
}

// ---------------------------------------------------------------------------------------------------

std::span<const ListItem> propertyList(int number) {
  static constexpr std::span<const ListItem> kLists[] = {kBoolean,   kScrollBars,  kAlignment,    kComboStyle,
                                                         kListStyle, kButtonStyle, kListViewView, kLabelEdit};
  if (number < 1 || number > int(std::size(kLists))) return {};
  return kLists[number - 1];
}

std::vector<CPropValue> JoinData(std::span<const ListItem> pairs) {
  std::vector<CPropValue> values;
  values.reserve(pairs.size());
  for (const ListItem& pair : pairs)
    values.push_back({QString::fromLatin1(pair.name), QVariant::fromValue(pair.value)});
  return values;
}

CVBCTProperty& AddProperty(CVBCTProperties& rows, const QString& name, ide::VBControl& control,
                           std::optional<CPropValue> defaultValue, std::span<const ListItem> list) {
  try {
    CVBCTProperty row;
    row.PropertyName = name;
    row.DefaultValue = std::move(defaultValue);
    const QVariant current = currentValue(control, name);
    row.SelectedValue.Value = current;
    if (list.empty()) {
      row.SelectedValue.ValueName = valueText(current);
    } else {
      row.PropertyType = kChooseFromList;
      row.Values = JoinData(list);
      for (const CPropValue& item : row.Values) {
        if (current.isValid() && sameValue(item.Value, current)) {
          row.SelectedValue.ValueName = item.ValueName;
          break;
        }
      }
    }
    return rows.Add(std::move(row), name);
  } catch (const std::exception& failure) {
    throw common::recordError(failure, kModule, QStringLiteral("AddProperty"), __LINE__);
  }
}

void AddCommonProperties(CVBCTProperties& rows, ide::VBControl& control) {
  try {
    const auto properties = control.Properties();
    const int count = properties->Count();
    for (int i = 1; i <= count; ++i) {
      const auto property = properties->Item(i);
      const QString name = property->Name();
      const QString lower = name.toLower();
      if (!isOneOf(lower, kCommonProperties) || rows.contains(name)) continue;
      QVariant value;
      try {
        value = property->Value();
      } catch (const std::exception&) {
        continue;  // a property that cannot be read is not offered
      }
      AddProperty(rows, name, control, CPropValue{valueText(value), value},
                  isOneOf(lower, kCommonListProperties) ? propertyList(1) : std::span<const ListItem>());
    }
  } catch (const std::exception& failure) {
    throw common::recordError(failure, kModule, QStringLiteral("AddCommonProperties"), __LINE__);
  }
}

CVBCTProperties CriarPropriedades(ide::VBControl& control) {
  try {
    CVBCTProperties rows;
    const QString name = valueText(currentValue(control, QStringLiteral("Name")));
    AddProperty(rows, QStringLiteral("Name"), control, CPropValue{name, name});
    AddProperty(rows, QStringLiteral("Index"), control,
                numericDefault(QStringLiteral("-1"), currentValue(control, QStringLiteral("Index"))));

    const QString className = control.ClassName();
    for (const ClassRows& entry : kClasses) {
      if (className != QLatin1StringView(entry.className)) continue;
      for (const RowSpec& row : entry.rows) {
        const QString property = QString::fromLatin1(row.property);
        std::optional<CPropValue> defaultValue;
        if (row.list == 0)
          defaultValue = row.numericDefault ? numericDefault(QString::fromLatin1(row.numericDefault),
                                                             currentValue(control, property))
                                            : CPropValue{QString(), QString()};
        AddProperty(rows, property, control, std::move(defaultValue), propertyList(row.list));
      }
      return rows;
    }
    AddCommonProperties(rows, control);
    return rows;
  } catch (const std::exception& failure) {
    throw common::recordError(failure, kModule, QStringLiteral("CriarPropriedades"), __LINE__);
  }
}

}  // namespace designer
