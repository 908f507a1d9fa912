// SPDX-License-Identifier: MIT
// The rows of the control property defaults dialog: which properties each control class offers, with
// their lists of named values and their defaults, read from the control as it is. No widgets: frmProps
// shows these rows and writes them back.
#pragma once

#include "ide/vbide.h"

#include <QString>
#include <QVariant>

#include <memory>
#include <optional>
#include <span>
#include <vector>

namespace designer {

/// One value: what is shown, and what is written to the property.
struct CPropValue {
  QString ValueName;
  QVariant Value;
};

/// The kinds of row (`PropertyType`).
inline constexpr qint32 kFreeText = 0;
inline constexpr qint32 kChooseFromList = 2;

/// One property row.
class CVBCTProperty {
 public:
  /// The list of a kChooseFromList row, in list order (empty for free text).
  std::vector<CPropValue> Values;
  QString PropertyName;
  qint32 PropertyType = kFreeText;
  /// What the row holds now; starts as the control's current value.
  CPropValue SelectedValue;
  /// Taken when a free-text box is left empty.
  std::optional<CPropValue> DefaultValue;

  /// The list value of that name, or null.
  const CPropValue* value(const QString& valueName) const;
  /// The text the row's box shows: the selected value's name (an Index of -1 shows nothing).
  QString shownText() const;
};

/// The rows in the order they were added, keyed by property name (case-insensitive, as a VB collection).
class CVBCTProperties {
 public:
  using Items = std::vector<std::shared_ptr<CVBCTProperty>>;

  /// Adds the row under `key`; error 457 when the key is taken.
  CVBCTProperty& Add(CVBCTProperty property, const QString& key);
  /// 1-based; error 9 outside.
  CVBCTProperty& Item(int index) const;
  /// Error 5 for a key that is not there.
  CVBCTProperty& Item(const QString& key) const;
  bool contains(const QString& key) const;
  int Count() const { return static_cast<int>(m_items.size()); }
  void Remove(const QString& key);
  void Clear();
  Items::const_iterator begin() const { return m_items.begin(); }
  Items::const_iterator end() const { return m_items.end(); }

 private:
  Items::const_iterator find(const QString& key) const;

  Items m_items;
  std::vector<QString> m_keys;
};

/// A pair of a list: the name shown and the value written.
struct ListItem {
  const char* name;
  qint32 value;
};

/// The eight lists of named values (1 to 8); an empty span for any other number.
std::span<const ListItem> propertyList(int number);

/// Packs a list's pairs into the values of a row.
std::vector<CPropValue> JoinData(std::span<const ListItem> pairs);

/// Creates the row `name` with its default and (for a list row) its values, reads the control's current
/// value into SelectedValue (a property that cannot be read leaves it empty), and adds the row.
CVBCTProperty& AddProperty(CVBCTProperties& rows, const QString& name, ide::VBControl& control,
                           std::optional<CPropValue> defaultValue, std::span<const ListItem> list = {});

/// The rows of a class outside the table: those of the control's own properties named Caption, Sorted,
/// Enabled, Locked or ToolTipText (any case), in the control's order, each defaulting to its value now.
void AddCommonProperties(CVBCTProperties& rows, ide::VBControl& control);

/// Every row for the control: Name and Index, then its class's rows. At most eight.
CVBCTProperties CriarPropriedades(ide::VBControl& control);

}  // namespace designer
