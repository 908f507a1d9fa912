// SPDX-License-Identifier: MIT
// Tests of the intrinsic control tables and the value conversions: how classes and properties are looked
// up, that every table entry is consistent with its type, how value texts read and are written, and how
// assigned values convert.
#include "host/files/controlclasses.h"

#include "host/files/formdescription.h"

#include <gtest/gtest.h>

#include <map>
#include <string>
#include <vector>

namespace host {
namespace {

// --- Tables ----------------------------------------------------------------------------------------------

TEST(ControlClassesTest, FindsClassesAndPropertiesCaseInsensitively) {
  const ControlClassInfo* textBox = findControlClass(u"VB.TextBox");
  ASSERT_NE(textBox, nullptr);
  EXPECT_EQ(textBox->className, u"VB.TextBox");
  EXPECT_EQ(findControlClass(u"textbox"), textBox);
  EXPECT_EQ(findControlClass(u"vb.TEXTBOX"), textBox);
  ASSERT_NE(findControlClass(u"MSComctlLib.ListView"), nullptr);
  EXPECT_EQ(findControlClass(u"ListView"), nullptr) << "only intrinsic classes drop their library";
  EXPECT_EQ(findControlClass(u"VB.Bogus"), nullptr);

  EXPECT_EQ(findPropertyInfo(u"TextBox", u"locked"), findPropertyInfo(u"VB.TextBox", u"Locked"));
  EXPECT_EQ(findPropertyInfo(u"Label", u"TabStop"), nullptr) << "a property the class does not have";
  EXPECT_EQ(findPropertyInfo(u"VB.Form", u"Bogus"), nullptr);
  EXPECT_EQ(findPropertyInfo(u"Threed.SSPanel", u"Caption"), nullptr);
  const PropertyInfo unknown = propertyInfoOrUntyped(u"Threed.SSPanel", u"Caption3D");
  EXPECT_EQ(unknown.name, u"Caption3D");
  EXPECT_EQ(unknown.type, PropertyType::Untyped);
  EXPECT_FALSE(unknown.defaultValue.isValid());
  EXPECT_EQ(propertyInfoOrUntyped(u"TextBox", u"locked").type, PropertyType::Boolean);

  const PropertyInfo& borderStyle = *findPropertyInfo(u"Form", u"BorderStyle");
  EXPECT_EQ(valueName(borderStyle, 3), u"Fixed Dialog");
  EXPECT_EQ(valueName(borderStyle, 6), u"") << "not a listed value";
}

// Every entry's default has the type its property declares, enumerated defaults are listed values, each
// default written as the IDE writes it reads back as itself, and no property is listed twice: the reader
// reports these defaults for every property a file leaves out.
TEST(ControlClassesTest, TablesAreConsistent) {
  const std::map<PropertyType, int> typeIds = {
      {PropertyType::String, QMetaType::QString}, {PropertyType::Boolean, QMetaType::Bool},
      {PropertyType::Integer, QMetaType::Short},  {PropertyType::Long, QMetaType::Int},
      {PropertyType::Color, QMetaType::Int},      {PropertyType::Single, QMetaType::Float},
      {PropertyType::Double, QMetaType::Double},  {PropertyType::Enumerated, QMetaType::Int}};
  for (const char* name : {"Form",         "MDIForm",
                           "TextBox",      "CommandButton",
                           "Label",        "ComboBox",
                           "ListBox",      "Frame",
                           "Timer",        "CheckBox",
                           "OptionButton", "PictureBox",
                           "Image",        "Menu",
                           "HScrollBar",   "VScrollBar",
                           "Shape",        "Line",
                           "DriveListBox", "DirListBox",
                           "FileListBox",  "MSComctlLib.ListView"}) {
    const ControlClassInfo* info = findControlClass(QString::fromLatin1(name));
    ASSERT_NE(info, nullptr) << name;
    QStringList seen;
    for (const PropertyInfo& property : info->properties) {
      const std::string where = std::string(name) + "." + property.name.toStdString();
      EXPECT_FALSE(seen.contains(property.name, Qt::CaseInsensitive)) << "listed twice: " << where;
      seen.append(property.name);
      EXPECT_EQ(property.type == PropertyType::Enumerated, !property.valueNames.empty()) << where;
      if (!property.defaultValue.isValid()) continue;
      if (property.type == PropertyType::Untyped) continue;
      EXPECT_EQ(property.defaultValue.typeId(), typeIds.at(property.type)) << where;
      EXPECT_EQ(
          parsePropertyValue(formatPropertyValue(property.defaultValue, property).valueText, property.type),
          property.defaultValue)
          << where;
      if (property.type == PropertyType::Enumerated) {
        EXPECT_FALSE(valueName(property, property.defaultValue.toInt()).isEmpty())
            << "default not listed: " << where;
      }
    }
  }
}

// --- Reading value texts ---------------------------------------------------------------------------------

TEST(PropertyValueTest, ParsesValueTextsByType) {
  struct Case {
    const char* text;
    PropertyType type;
    QVariant expected;  // invalid: the text does not fit the type
  };
  const QVariant refused;
  const std::vector<Case> cases = {
      {"\"Form1\"", PropertyType::String, u"Form1"_qs},
      {"\"a\"\"b\"", PropertyType::String, u"a\"b"_qs},
      {"\"\"", PropertyType::String, QString()},
      {"\"Endereço\"", PropertyType::String, QString::fromUtf8("Endereço")},
      {"\"Form1.frx\":0000", PropertyType::String, refused},  // text kept in the .frx is not a literal
      {"\"a\"b\"", PropertyType::String, refused},
      {"Form1", PropertyType::String, refused},
      {"-1", PropertyType::Boolean, true},
      {"0", PropertyType::Boolean, false},
      {"1", PropertyType::Boolean, true},
      {"True", PropertyType::Boolean, refused},
      {"120", PropertyType::Integer, QVariant::fromValue(qint16(120))},
      {"-32768", PropertyType::Integer, QVariant::fromValue(qint16(-32768))},
      {"32768", PropertyType::Integer, refused},
      {"1.5", PropertyType::Integer, refused},
      {"65535", PropertyType::Long, qint32(65535)},
      {"2147483648", PropertyType::Long, refused},
      {"8.25", PropertyType::Single, 8.25f},
      {"1739,9", PropertyType::Single, 1739.9f},  // saved under a locale with a decimal comma
      {"3195", PropertyType::Single, 3195.0f},
      {"abc", PropertyType::Single, refused},
      {"37622.5", PropertyType::Double, 37622.5},
      {"&H8000000F&", PropertyType::Color, qint32(0x8000000F)},
      {"&HFF&", PropertyType::Color, qint32(0xFF)},
      {"12648447", PropertyType::Color, qint32(12648447)},
      {"&HGG&", PropertyType::Color, refused},
      {"&H1FFFFFFFF&", PropertyType::Color, refused},
      {"2", PropertyType::Enumerated, qint32(2)},
      // Untyped values keep the kind their text shows.
      {"\"Nome\"", PropertyType::Untyped, u"Nome"_qs},
      {"393217", PropertyType::Untyped, qint32(393217)},
      {"&H8000000F&", PropertyType::Untyped, qint32(0x8000000F)},
      {"8.25", PropertyType::Untyped, 8.25},
      {"^Q", PropertyType::Untyped, u"^Q"_qs},
      {"\"Form1.frx\":0000", PropertyType::Untyped, u"\"Form1.frx\":0000"_qs},
  };
  for (const Case& sample : cases) {
    SCOPED_TRACE(sample.text);
    const QVariant value = parsePropertyValue(QString::fromUtf8(sample.text), sample.type);
    ASSERT_EQ(value.isValid(), sample.expected.isValid());
    EXPECT_EQ(value.typeId(), sample.expected.typeId());
    EXPECT_EQ(value, sample.expected);
  }
}

// --- Writing values --------------------------------------------------------------------------------------

TEST(PropertyValueTest, FormatsAsTheIdeWrites) {
  struct Case {
    const char* className;
    const char* property;
    QVariant value;
    const char* valueText;
    const char* comment;
  };
  const std::vector<Case> cases = {
      {"TextBox", "Visible", true, "-1", "'True"},
      {"TextBox", "Visible", false, "0", "'False"},
      {"Form", "StartUpPosition", qint32(2), "2", "'CenterScreen"},
      {"Form", "StartUpPosition", qint32(9), "9", ""},  // no name, no comment
      {"MSComctlLib.ListView", "View", qint32(3), "3", ""},
      {"MSComctlLib.ListView", "DragMode", qint32(1), "1", "'Automatic"},  // an extender property
      {"Form", "BackColor", qint32(0x8000000F), "&H8000000F&", ""},
      {"Form", "BackColor", qint32(0xFF00), "&H0000FF00&", ""},
      {"Form", "Caption", u"Diga \"olá\""_qs, "\"Diga \"\"olá\"\"\"", ""},
      {"Form", "Caption", QString(), "\"\"", ""},
      {"Form", "ScaleHeight", 1264.2f, "1264.2", ""},
      {"Form", "ClientHeight", 3195.0f, "3195", ""},
      {"TextBox", "TabIndex", QVariant::fromValue(qint16(-5)), "-5", ""},
      {"TextBox", "MaxLength", qint32(40), "40", ""},
      {"Threed.SSPanel", "Caption", u"x"_qs, "\"x\"", ""},
      {"Threed.SSPanel", "Caption", qint32(7), "7", ""},
      {"Threed.SSPanel", "Caption", true, "-1", "'True"},
      {"Threed.SSPanel", "Caption", 2.5, "2.5", ""},
  };
  for (const Case& sample : cases) {
    SCOPED_TRACE(std::string(sample.className) + "." + sample.property + " = " + sample.valueText);
    const PropertyInfo info =
        propertyInfoOrUntyped(QString::fromLatin1(sample.className), QString::fromLatin1(sample.property));
    const FormattedValue formatted = formatPropertyValue(sample.value, info);
    EXPECT_EQ(formatted.valueText, QString::fromUtf8(sample.valueText));
    EXPECT_EQ(formatted.comment, QString::fromUtf8(sample.comment));
  }
}

// --- Converting assigned values --------------------------------------------------------------------------

TEST(PropertyValueTest, ConvertsAssignedValues) {
  struct Case {
    QVariant in;
    PropertyType type;
    QVariant expected;  // invalid: the assignment fails
  };
  const QVariant fails;
  const std::vector<Case> cases = {
      {u"5"_qs, PropertyType::Long, qint32(5)},
      {u" 5 "_qs, PropertyType::Long, qint32(5)},
      {u"&HFF"_qs, PropertyType::Long, qint32(255)},
      {u"abc"_qs, PropertyType::Long, fails},
      {u"5abc"_qs, PropertyType::Long, fails},
      {QVariant(), PropertyType::Long, fails},
      {7.6, PropertyType::Long, qint32(8)},
      {2.5, PropertyType::Integer, QVariant::fromValue(qint16(2))},  // halves round to even
      {3.5, PropertyType::Integer, QVariant::fromValue(qint16(4))},
      {-2.5, PropertyType::Integer, QVariant::fromValue(qint16(-2))},
      {32767, PropertyType::Integer, QVariant::fromValue(qint16(32767))},
      {40000, PropertyType::Integer, fails},  // overflow
      {qint64(1) << 40, PropertyType::Long, fails},
      {true, PropertyType::Integer, QVariant::fromValue(qint16(-1))},
      {5, PropertyType::Boolean, true},
      {-0.5, PropertyType::Boolean, true},
      {0, PropertyType::Boolean, false},
      {u"true"_qs, PropertyType::Boolean, true},
      {u"False"_qs, PropertyType::Boolean, false},
      {u"2"_qs, PropertyType::Boolean, true},
      {u"sim"_qs, PropertyType::Boolean, fails},
      {42, PropertyType::String, u"42"_qs},
      {true, PropertyType::String, u"True"_qs},
      {1.5, PropertyType::String, u"1.5"_qs},
      {u"x"_qs, PropertyType::String, u"x"_qs},
      {u"8.25"_qs, PropertyType::Single, 8.25f},
      {1e300, PropertyType::Single, fails},
      {u"1e3"_qs, PropertyType::Double, 1000.0},
      {u"&H8000000F&"_qs, PropertyType::Color, qint32(0x8000000F)},
      {u"anything"_qs, PropertyType::Untyped, u"anything"_qs},
  };
  for (const Case& sample : cases) {
    SCOPED_TRACE(sample.in.toString().toStdString() + " as type " + std::to_string(int(sample.type)));
    const std::optional<QVariant> converted = convertPropertyValue(sample.in, sample.type);
    ASSERT_EQ(converted.has_value(), sample.expected.isValid());
    if (!converted) continue;
    EXPECT_EQ(converted->typeId(), sample.expected.typeId());
    EXPECT_EQ(*converted, sample.expected);
  }

  // An enumerated value must be one the property lists; other types convert as their type alone says.
  const PropertyInfo& position = *findPropertyInfo(u"Form", u"StartUpPosition");
  EXPECT_EQ(convertPropertyValue(u"3"_qs, position), QVariant(qint32(3)));
  EXPECT_FALSE(convertPropertyValue(4, position).has_value());
  EXPECT_FALSE(convertPropertyValue(-1, position).has_value());
  EXPECT_EQ(convertPropertyValue(u"9"_qs, *findPropertyInfo(u"Timer", u"Interval")), QVariant(qint32(9)));
}

}  // namespace
}  // namespace host
