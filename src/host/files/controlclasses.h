// SPDX-License-Identifier: MIT
// What the IDE knows about the properties of its intrinsic controls (and of the common ListView): each
// property's type, the value the IDE reports when a form description leaves the property out (it omits
// properties at their defaults), and the names of enumerated values that it writes as comments. Also the
// conversions between a property line's value text, a typed value, and values assigned by code.
#pragma once

#include <QString>
#include <QStringView>
#include <QVariant>

#include <optional>
#include <span>
#include <vector>

namespace host {

enum class PropertyType : quint8 {
  String,      // a quoted string with doubled quotes; QString
  Boolean,     // -1 'True / 0 'False; bool
  Integer,     // 16-bit; qint16
  Long,        // 32-bit; qint32
  Single,      // float
  Double,      // double
  Color,       // a Long written as &H0000FF00&; qint32
  Enumerated,  // a number written with its value name as comment (2 'CenterScreen); qint32
  Untyped,     // unknown class or property: the value as written decides (strings stay strings ...)
};

struct EnumValue {
  qint32 value;
  const char* name;  // as the IDE writes it after the apostrophe: "Fixed Single"
};

struct PropertyInfo {
  QString name;
  PropertyType type = PropertyType::Untyped;
  QVariant defaultValue;  // invalid when there is none (Name, Index, pictures)
  std::span<const EnumValue> valueNames;
  bool writesValueName = true;  // ActiveX controls save enumerations without the name comment
};

struct ControlClassInfo {
  QString className;  // "VB.TextBox", "MSComctlLib.ListView"
  std::vector<PropertyInfo> properties;
};

/// The class as written on a Begin line ("VB.TextBox"; the "VB." prefix may be left out), or null.
const ControlClassInfo* findControlClass(QStringView className);

/// The property of the class (case-insensitive), or null for unknown classes and properties.
const PropertyInfo* findPropertyInfo(QStringView className, QStringView propertyName);

/// The property's information, or an Untyped stand-in for unknown classes and properties.
PropertyInfo propertyInfoOrUntyped(QStringView className, QStringView propertyName);

/// The name of an enumerated value, or an empty text.
QString valueName(const PropertyInfo& info, qint32 value);

/// Reads a property line's value text (without its comment) as `type`; an invalid QVariant when the text
/// does not fit (for example a String stored in the .frx: "Form1.frx":0000).
QVariant parsePropertyValue(QStringView text, PropertyType type);

struct FormattedValue {
  QString valueText;
  QString comment;  // with its apostrophe, or empty
};

/// The value text and comment the IDE writes for `value`.
FormattedValue formatPropertyValue(const QVariant& value, const PropertyInfo& info);

/// Converts a value assigned by code to the property's type, as VB's assignment would: "5" to a Long is 5,
/// "abc" to a Long fails, any non-zero number to a Boolean is True; out of range fails.
std::optional<QVariant> convertPropertyValue(const QVariant& in, PropertyType type);

/// As above, and an enumerated value must be one the property lists.
std::optional<QVariant> convertPropertyValue(const QVariant& in, const PropertyInfo& info);

}  // namespace host
