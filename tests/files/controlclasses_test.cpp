// SPDX-License-Identifier: MIT
// Tests of the intrinsic control tables and the value conversions: the classes and properties the IDE
// knows, their types, defaults and value names, how value texts read and are written, and how assigned
// values convert.
#include "host/files/controlclasses.h"

#include "host/files/formdescription.h"

#include <gtest/gtest.h>

#include <cmath>

namespace host {
namespace {

// --- Tables ----------------------------------------------------------------------------------------------

TEST(ControlClassesTest, FindsClassesWithOrWithoutTheirLibrary) {
  const ControlClassInfo* textBox = findControlClass(u"VB.TextBox");
  ASSERT_NE(textBox, nullptr);
  EXPECT_EQ(textBox->className, u"VB.TextBox");
  EXPECT_EQ(findControlClass(u"textbox"), textBox);
  EXPECT_EQ(findControlClass(u"vb.TEXTBOX"), textBox);
  ASSERT_NE(findControlClass(u"MSComctlLib.ListView"), nullptr);
  EXPECT_EQ(findControlClass(u"ListView"), nullptr) << "only intrinsic classes drop their library";
  EXPECT_EQ(findControlClass(u"VB.Bogus"), nullptr);
  EXPECT_EQ(findControlClass(u"MSComctlLib.TreeView"), nullptr);
}

struct ExpectedProperties {
  const char* className;
  std::vector<const char*> properties;
};

TEST(ControlClassesTest, EveryClassHasItsProperties) {
  const std::vector<ExpectedProperties> expected = {
      {"Form", {"Name",
                "Left",
                "Top",
                "Width",
                "Height",
                "Visible",
                "Enabled",
                "Tag",
                "BackColor",
                "ForeColor",
                "Caption",
                "BorderStyle",
                "StartUpPosition",
                "MDIChild",
                "ClientHeight",
                "ClientWidth",
                "ClientLeft",
                "ClientTop",
                "ScaleHeight",
                "ScaleWidth",
                "KeyPreview",
                "MaxButton",
                "MinButton",
                "ShowInTaskbar",
                "WindowState",
                "ControlBox",
                "LinkTopic",
                "Icon"}},
      {"MDIForm",
       {"Name", "Caption", "BackColor", "ClientHeight", "ClientWidth", "ClientLeft", "ClientTop",
        "StartUpPosition", "ScrollBars", "AutoShowChildren", "Enabled", "Visible", "Tag"}},
      {"TextBox", {"Name",       "Index",     "Left",        "Top",         "Width",       "Height",
                   "TabIndex",   "TabStop",   "Visible",     "Enabled",     "ToolTipText", "Tag",
                   "BackColor",  "ForeColor", "Text",        "Locked",      "MaxLength",   "MultiLine",
                   "ScrollBars", "Alignment", "BorderStyle", "PasswordChar"}},
      {"CommandButton",
       {"Name", "Index", "Left", "Top", "Width", "Height", "TabIndex", "TabStop", "Visible", "Enabled",
        "ToolTipText", "Tag", "BackColor", "Caption", "Cancel", "Default", "Style"}},
      {"Label",
       {"Name", "Index", "Left", "Top", "Width", "Height", "TabIndex", "Visible", "Enabled", "ToolTipText",
        "Tag", "BackColor", "ForeColor", "BackStyle", "Caption", "Alignment", "WordWrap", "AutoSize",
        "BorderStyle"}},
      {"ComboBox",
       {"Name", "Index", "TabIndex", "TabStop", "Text", "Locked", "Style", "Sorted", "BackColor",
        "ForeColor"}},
      {"ListBox", {"Name", "Index", "TabIndex", "TabStop", "Style", "Sorted", "MultiSelect", "Columns"}},
      {"Frame", {"Name", "Index", "Caption", "BorderStyle", "TabIndex", "BackColor", "ForeColor", "Enabled"}},
      {"Timer", {"Name", "Index", "Interval", "Enabled", "Left", "Top", "Tag"}},
      {"CheckBox", {"Name", "Index", "Caption", "Value", "Alignment", "Style", "TabIndex", "TabStop"}},
      {"OptionButton", {"Name", "Index", "Caption", "Value", "Alignment", "Style", "TabIndex", "TabStop"}},
      {"PictureBox",
       {"Name", "Index", "AutoSize", "BorderStyle", "BackColor", "ScaleHeight", "ScaleWidth", "TabIndex",
        "TabStop", "Align"}},
      {"Image", {"Name", "Index", "BorderStyle", "Stretch", "Picture", "Visible", "Enabled", "ToolTipText"}},
      {"Menu",
       {"Name", "Index", "Caption", "Checked", "Enabled", "Visible", "WindowList", "Shortcut", "Tag"}},
      {"HScrollBar",
       {"Name", "Index", "Min", "Max", "Value", "SmallChange", "LargeChange", "TabIndex", "TabStop"}},
      {"VScrollBar",
       {"Name", "Index", "Min", "Max", "Value", "SmallChange", "LargeChange", "TabIndex", "TabStop"}},
      {"Shape", {"Name", "Index", "Shape", "BackStyle", "BackColor", "BorderStyle", "FillStyle", "Visible"}},
      {"Line", {"Name", "Index", "X1", "Y1", "X2", "Y2", "BorderStyle", "BorderWidth", "Visible"}},
      {"DriveListBox", {"Name", "Index", "TabIndex", "TabStop", "BackColor", "ForeColor", "Enabled"}},
      {"DirListBox", {"Name", "Index", "TabIndex", "TabStop", "BackColor", "ForeColor", "Enabled"}},
      {"FileListBox",
       {"Name", "Index", "TabIndex", "TabStop", "Pattern", "MultiSelect", "Archive", "Hidden"}},
      {"MSComctlLib.ListView",
       {"Name", "Index", "Left", "Top", "Width", "Height", "TabIndex", "TabStop", "Visible", "Enabled",
        "View", "LabelEdit", "Sorted", "HideSelection", "FullRowSelect", "BorderStyle", "Appearance",
        "_ExtentX", "_Version"}},
  };
  for (const ExpectedProperties& entry : expected) {
    const ControlClassInfo* info = findControlClass(QString::fromLatin1(entry.className));
    ASSERT_NE(info, nullptr) << entry.className;
    for (const char* property : entry.properties) {
      EXPECT_NE(findPropertyInfo(QString::fromLatin1(entry.className), QString::fromLatin1(property)),
                nullptr)
          << entry.className << "." << property;
    }
  }
  // Properties that do not apply are absent.
  EXPECT_EQ(findPropertyInfo(u"Label", u"TabStop"), nullptr);
  EXPECT_EQ(findPropertyInfo(u"Timer", u"Width"), nullptr);
  EXPECT_EQ(findPropertyInfo(u"Line", u"Left"), nullptr);
  EXPECT_EQ(findPropertyInfo(u"Menu", u"Left"), nullptr);
  EXPECT_EQ(findPropertyInfo(u"TextBox", u"Caption"), nullptr);
  EXPECT_EQ(findPropertyInfo(u"Form", u"Index"), nullptr);
  EXPECT_EQ(findPropertyInfo(u"MDIForm", u"Index"), nullptr);
  EXPECT_EQ(findPropertyInfo(u"CommandButton", u"Text"), nullptr);
}

TEST(ControlClassesTest, TablesAreConsistent) {
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
      switch (property.type) {
        case PropertyType::String:
          EXPECT_EQ(property.defaultValue.typeId(), QMetaType::QString) << where;
          break;
        case PropertyType::Boolean:
          EXPECT_EQ(property.defaultValue.typeId(), QMetaType::Bool) << where;
          break;
        case PropertyType::Integer:
          EXPECT_EQ(property.defaultValue.typeId(), QMetaType::Short) << where;
          break;
        case PropertyType::Long:
        case PropertyType::Color:
          EXPECT_EQ(property.defaultValue.typeId(), QMetaType::Int) << where;
          break;
        case PropertyType::Single:
          EXPECT_EQ(property.defaultValue.typeId(), QMetaType::Float) << where;
          break;
        case PropertyType::Double:
          EXPECT_EQ(property.defaultValue.typeId(), QMetaType::Double) << where;
          break;
        case PropertyType::Enumerated:
          EXPECT_EQ(property.defaultValue.typeId(), QMetaType::Int) << where;
          EXPECT_FALSE(valueName(property, property.defaultValue.toInt()).isEmpty())
              << "default not listed: " << where;
          break;
        case PropertyType::Untyped:
          break;
      }
    }
  }
}

TEST(ControlClassesTest, FormProperties) {
  const PropertyInfo* borderStyle = findPropertyInfo(u"VB.Form", u"BorderStyle");
  ASSERT_NE(borderStyle, nullptr);
  EXPECT_EQ(borderStyle->type, PropertyType::Enumerated);
  EXPECT_EQ(borderStyle->defaultValue, QVariant(qint32(2)));
  EXPECT_EQ(valueName(*borderStyle, 0), u"None");
  EXPECT_EQ(valueName(*borderStyle, 1), u"Fixed Single");
  EXPECT_EQ(valueName(*borderStyle, 2), u"Sizable");
  EXPECT_EQ(valueName(*borderStyle, 3), u"Fixed Dialog");
  EXPECT_EQ(valueName(*borderStyle, 4), u"Fixed ToolWindow");
  EXPECT_EQ(valueName(*borderStyle, 5), u"Sizable ToolWindow");
  EXPECT_EQ(valueName(*borderStyle, 6), u"");

  const PropertyInfo* position = findPropertyInfo(u"VB.Form", u"StartUpPosition");
  ASSERT_NE(position, nullptr);
  EXPECT_EQ(position->defaultValue, QVariant(qint32(0)))
      << "absent means Manual (files from before the property)";
  EXPECT_EQ(valueName(*position, 1), u"CenterOwner");
  EXPECT_EQ(valueName(*position, 2), u"CenterScreen");
  EXPECT_EQ(valueName(*position, 3), u"Windows Default");

  EXPECT_EQ(findPropertyInfo(u"Form", u"BackColor")->defaultValue, QVariant(qint32(0x8000000F)));
  EXPECT_EQ(findPropertyInfo(u"Form", u"BackColor")->type, PropertyType::Color);
  EXPECT_EQ(findPropertyInfo(u"Form", u"MaxButton")->defaultValue, QVariant(true));
  EXPECT_EQ(findPropertyInfo(u"Form", u"ShowInTaskbar")->defaultValue, QVariant(true));
  EXPECT_EQ(findPropertyInfo(u"Form", u"KeyPreview")->defaultValue, QVariant(false));
  EXPECT_EQ(findPropertyInfo(u"Form", u"MDIChild")->defaultValue, QVariant(false));
  EXPECT_EQ(findPropertyInfo(u"Form", u"ScaleMode")->defaultValue, QVariant(qint32(1)));
  EXPECT_EQ(findPropertyInfo(u"Form", u"ClientHeight")->type, PropertyType::Single);
  EXPECT_EQ(findPropertyInfo(u"Form", u"Caption")->defaultValue, QVariant(QString()));
  EXPECT_EQ(findPropertyInfo(u"MDIForm", u"BackColor")->defaultValue, QVariant(qint32(0x8000000C)));
  EXPECT_EQ(findPropertyInfo(u"MDIForm", u"ScrollBars")->type, PropertyType::Boolean);
  EXPECT_EQ(findPropertyInfo(u"MDIForm", u"ScrollBars")->defaultValue, QVariant(true));
}

TEST(ControlClassesTest, ControlProperties) {
  const PropertyInfo* scrollBars = findPropertyInfo(u"TextBox", u"ScrollBars");
  EXPECT_EQ(scrollBars->defaultValue, QVariant(qint32(0)));
  EXPECT_EQ(valueName(*scrollBars, 3), u"Both");
  EXPECT_EQ(findPropertyInfo(u"TextBox", u"BorderStyle")->defaultValue, QVariant(qint32(1)));
  EXPECT_EQ(findPropertyInfo(u"TextBox", u"BackColor")->defaultValue, QVariant(qint32(0x80000005)));
  EXPECT_EQ(findPropertyInfo(u"TextBox", u"ForeColor")->defaultValue, QVariant(qint32(0x80000008)));
  EXPECT_EQ(findPropertyInfo(u"TextBox", u"MaxLength")->type, PropertyType::Long);
  EXPECT_EQ(findPropertyInfo(u"TextBox", u"TabIndex")->type, PropertyType::Integer);
  EXPECT_EQ(findPropertyInfo(u"TextBox", u"Left")->type, PropertyType::Single);
  EXPECT_FALSE(findPropertyInfo(u"TextBox", u"Index")->defaultValue.isValid());
  EXPECT_EQ(valueName(*findPropertyInfo(u"TextBox", u"Alignment"), 1), u"Right Justify");

  EXPECT_EQ(findPropertyInfo(u"Label", u"BorderStyle")->defaultValue, QVariant(qint32(0)));
  EXPECT_EQ(findPropertyInfo(u"Label", u"BackStyle")->defaultValue, QVariant(qint32(1)));
  EXPECT_EQ(valueName(*findPropertyInfo(u"Label", u"BackStyle"), 0), u"Transparent");
  EXPECT_EQ(findPropertyInfo(u"Label", u"WordWrap")->defaultValue, QVariant(false));

  EXPECT_EQ(valueName(*findPropertyInfo(u"ComboBox", u"Style"), 2), u"Dropdown List");
  EXPECT_EQ(valueName(*findPropertyInfo(u"ListBox", u"Style"), 1), u"Checkbox");
  EXPECT_EQ(valueName(*findPropertyInfo(u"ListBox", u"MultiSelect"), 2), u"Extended");
  EXPECT_EQ(valueName(*findPropertyInfo(u"CommandButton", u"Style"), 1), u"Graphical");
  EXPECT_EQ(findPropertyInfo(u"CommandButton", u"Cancel")->defaultValue, QVariant(false));

  EXPECT_EQ(findPropertyInfo(u"Timer", u"Interval")->type, PropertyType::Long);
  EXPECT_EQ(findPropertyInfo(u"Timer", u"Interval")->defaultValue, QVariant(qint32(0)));
  EXPECT_EQ(findPropertyInfo(u"Timer", u"Enabled")->defaultValue, QVariant(true));

  // A CheckBox's Value has three states; an OptionButton's is a Boolean.
  EXPECT_EQ(findPropertyInfo(u"CheckBox", u"Value")->type, PropertyType::Enumerated);
  EXPECT_EQ(valueName(*findPropertyInfo(u"CheckBox", u"Value"), 2), u"Grayed");
  EXPECT_EQ(findPropertyInfo(u"OptionButton", u"Value")->type, PropertyType::Boolean);

  EXPECT_EQ(findPropertyInfo(u"HScrollBar", u"Max")->defaultValue, QVariant::fromValue(qint16(32767)));
  EXPECT_EQ(valueName(*findPropertyInfo(u"Shape", u"Shape"), 4), u"Rounded Rectangle");
  EXPECT_EQ(findPropertyInfo(u"Shape", u"BackStyle")->defaultValue, QVariant(qint32(0)));
  EXPECT_EQ(valueName(*findPropertyInfo(u"Line", u"BorderStyle"), 6), u"Inside Solid");
  EXPECT_EQ(findPropertyInfo(u"FileListBox", u"Pattern")->defaultValue, QVariant(QStringLiteral("*.*")));
  EXPECT_EQ(valueName(*findPropertyInfo(u"PictureBox", u"Align"), 2), u"Align Bottom");
  EXPECT_EQ(valueName(*findPropertyInfo(u"Form", u"MousePointer"), 11), u"Hourglass");
  EXPECT_EQ(valueName(*findPropertyInfo(u"Form", u"MousePointer"), 99), u"Custom");
  EXPECT_EQ(valueName(*findPropertyInfo(u"Form", u"DrawMode"), 7), u"Invert") << "as saved files name it";
  EXPECT_EQ(findPropertyInfo(u"Menu", u"Shortcut")->type, PropertyType::Untyped);
}

TEST(ControlClassesTest, ListViewProperties) {
  const PropertyInfo* view = findPropertyInfo(u"MSComctlLib.ListView", u"View");
  ASSERT_NE(view, nullptr);
  EXPECT_EQ(view->type, PropertyType::Enumerated);
  EXPECT_EQ(view->defaultValue, QVariant(qint32(0)));
  EXPECT_EQ(valueName(*view, 3), u"lvwReport");
  EXPECT_FALSE(view->writesValueName);
  EXPECT_EQ(valueName(*findPropertyInfo(u"MSComctlLib.ListView", u"LabelEdit"), 1), u"lvwManual");
  EXPECT_EQ(findPropertyInfo(u"MSComctlLib.ListView", u"LabelWrap")->defaultValue, QVariant(true));
  EXPECT_EQ(findPropertyInfo(u"MSComctlLib.ListView", u"ForeColor")->type, PropertyType::Long);
  EXPECT_FALSE(findPropertyInfo(u"MSComctlLib.ListView", u"MousePointer")->writesValueName);
  EXPECT_TRUE(findPropertyInfo(u"MSComctlLib.ListView", u"DragMode")->writesValueName)
      << "an extender property";
}

TEST(ControlClassesTest, UnknownPropertiesAreUntyped) {
  EXPECT_EQ(findPropertyInfo(u"VB.Form", u"Bogus"), nullptr);
  EXPECT_EQ(findPropertyInfo(u"Threed.SSPanel", u"Caption"), nullptr);
  const PropertyInfo unknown = propertyInfoOrUntyped(u"Threed.SSPanel", u"Caption3D");
  EXPECT_EQ(unknown.name, u"Caption3D");
  EXPECT_EQ(unknown.type, PropertyType::Untyped);
  EXPECT_FALSE(unknown.defaultValue.isValid());
  EXPECT_EQ(propertyInfoOrUntyped(u"TextBox", u"locked").type, PropertyType::Boolean);
}

// --- Reading value texts ---------------------------------------------------------------------------------

TEST(PropertyValueTest, ParsesStrings) {
  EXPECT_EQ(parsePropertyValue(u"\"Form1\"", PropertyType::String), QVariant(QStringLiteral("Form1")));
  EXPECT_EQ(parsePropertyValue(u"\"a\"\"b\"", PropertyType::String), QVariant(QStringLiteral("a\"b")));
  EXPECT_EQ(parsePropertyValue(u"\"\"", PropertyType::String), QVariant(QString()));
  EXPECT_EQ(parsePropertyValue(QString::fromUtf8("\"Endereço\""), PropertyType::String),
            QVariant(QString::fromUtf8("Endereço")));
  // Text kept in the .frx is not a literal.
  EXPECT_FALSE(parsePropertyValue(u"\"Form1.frx\":0000", PropertyType::String).isValid());
  EXPECT_FALSE(parsePropertyValue(u"$\"Form1.frx\":0000", PropertyType::String).isValid());
  EXPECT_FALSE(parsePropertyValue(u"\"a\"b\"", PropertyType::String).isValid());
  EXPECT_FALSE(parsePropertyValue(u"Form1", PropertyType::String).isValid());
}

TEST(PropertyValueTest, ParsesBooleans) {
  EXPECT_EQ(parsePropertyValue(u"-1", PropertyType::Boolean), QVariant(true));
  EXPECT_EQ(parsePropertyValue(u"0", PropertyType::Boolean), QVariant(false));
  EXPECT_EQ(parsePropertyValue(u"1", PropertyType::Boolean), QVariant(true));
  EXPECT_FALSE(parsePropertyValue(u"True", PropertyType::Boolean).isValid());
}

TEST(PropertyValueTest, ParsesNumbersByType) {
  const QVariant integer = parsePropertyValue(u"120", PropertyType::Integer);
  EXPECT_EQ(integer.typeId(), QMetaType::Short);
  EXPECT_EQ(integer.value<qint16>(), 120);
  EXPECT_EQ(parsePropertyValue(u"-32768", PropertyType::Integer).value<qint16>(), -32768);
  EXPECT_FALSE(parsePropertyValue(u"32768", PropertyType::Integer).isValid());
  EXPECT_FALSE(parsePropertyValue(u"1.5", PropertyType::Integer).isValid());

  const QVariant longValue = parsePropertyValue(u"65535", PropertyType::Long);
  EXPECT_EQ(longValue.typeId(), QMetaType::Int);
  EXPECT_EQ(longValue.toInt(), 65535);
  EXPECT_EQ(parsePropertyValue(u"-2147483640", PropertyType::Long).toInt(), -2147483640);
  EXPECT_FALSE(parsePropertyValue(u"2147483648", PropertyType::Long).isValid());

  const QVariant single = parsePropertyValue(u"8.25", PropertyType::Single);
  EXPECT_EQ(single.typeId(), QMetaType::Float);
  EXPECT_FLOAT_EQ(single.toFloat(), 8.25f);
  EXPECT_FLOAT_EQ(parsePropertyValue(u"1739,9", PropertyType::Single).toFloat(), 1739.9f)
      << "saved under a locale with a decimal comma";
  EXPECT_FLOAT_EQ(parsePropertyValue(u"3195", PropertyType::Single).toFloat(), 3195.0f);
  EXPECT_FALSE(parsePropertyValue(u"abc", PropertyType::Single).isValid());

  const QVariant number = parsePropertyValue(u"37622.5", PropertyType::Double);
  EXPECT_EQ(number.typeId(), QMetaType::Double);
  EXPECT_DOUBLE_EQ(number.toDouble(), 37622.5);
}

TEST(PropertyValueTest, ParsesColorsAndEnumerations) {
  const QVariant buttonFace = parsePropertyValue(u"&H8000000F&", PropertyType::Color);
  EXPECT_EQ(buttonFace.typeId(), QMetaType::Int);
  EXPECT_EQ(static_cast<quint32>(buttonFace.toInt()), 0x8000000Fu);
  EXPECT_EQ(parsePropertyValue(u"&H00FF8080&", PropertyType::Color).toInt(), 0x00FF8080);
  EXPECT_EQ(parsePropertyValue(u"&HFF&", PropertyType::Color).toInt(), 0xFF);
  EXPECT_EQ(parsePropertyValue(u"12648447", PropertyType::Color).toInt(), 12648447);
  EXPECT_FALSE(parsePropertyValue(u"&HGG&", PropertyType::Color).isValid());
  EXPECT_FALSE(parsePropertyValue(u"&H1FFFFFFFF&", PropertyType::Color).isValid());

  const QVariant position = parsePropertyValue(u"2", PropertyType::Enumerated);
  EXPECT_EQ(position.typeId(), QMetaType::Int);
  EXPECT_EQ(position.toInt(), 2);
}

TEST(PropertyValueTest, UntypedValuesKeepTheirKind) {
  EXPECT_EQ(parsePropertyValue(u"\"Nome\"", PropertyType::Untyped), QVariant(QStringLiteral("Nome")));
  const QVariant number = parsePropertyValue(u"393217", PropertyType::Untyped);
  EXPECT_EQ(number.typeId(), QMetaType::Int);
  EXPECT_EQ(number.toInt(), 393217);
  EXPECT_EQ(parsePropertyValue(u"-1", PropertyType::Untyped), QVariant(qint32(-1)));
  EXPECT_EQ(parsePropertyValue(u"&H8000000F&", PropertyType::Untyped), QVariant(qint32(0x8000000F)));
  const QVariant decimal = parsePropertyValue(u"8.25", PropertyType::Untyped);
  EXPECT_EQ(decimal.typeId(), QMetaType::Double);
  EXPECT_DOUBLE_EQ(decimal.toDouble(), 8.25);
  EXPECT_EQ(parsePropertyValue(u"^Q", PropertyType::Untyped), QVariant(QStringLiteral("^Q")));
  EXPECT_EQ(parsePropertyValue(u"\"Form1.frx\":0000", PropertyType::Untyped),
            QVariant(QStringLiteral("\"Form1.frx\":0000")));
}

// --- Writing values --------------------------------------------------------------------------------------

TEST(PropertyValueTest, FormatsAsTheIdeWrites) {
  const PropertyInfo& visible = *findPropertyInfo(u"TextBox", u"Visible");
  EXPECT_EQ(formatPropertyValue(true, visible).valueText, u"-1");
  EXPECT_EQ(formatPropertyValue(true, visible).comment, u"'True");
  EXPECT_EQ(formatPropertyValue(false, visible).valueText, u"0");
  EXPECT_EQ(formatPropertyValue(false, visible).comment, u"'False");

  const PropertyInfo& position = *findPropertyInfo(u"Form", u"StartUpPosition");
  EXPECT_EQ(formatPropertyValue(qint32(2), position).valueText, u"2");
  EXPECT_EQ(formatPropertyValue(qint32(2), position).comment, u"'CenterScreen");
  EXPECT_EQ(formatPropertyValue(qint32(9), position).comment, u"") << "no name, no comment";

  const PropertyInfo& view = *findPropertyInfo(u"MSComctlLib.ListView", u"View");
  EXPECT_EQ(formatPropertyValue(qint32(3), view).valueText, u"3");
  EXPECT_EQ(formatPropertyValue(qint32(3), view).comment, u"");

  const PropertyInfo& backColor = *findPropertyInfo(u"Form", u"BackColor");
  EXPECT_EQ(formatPropertyValue(qint32(0x8000000F), backColor).valueText, u"&H8000000F&");
  EXPECT_EQ(formatPropertyValue(qint32(0xFF00), backColor).valueText, u"&H0000FF00&");
  EXPECT_EQ(formatPropertyValue(qint32(0), backColor).valueText, u"&H00000000&");

  const PropertyInfo& caption = *findPropertyInfo(u"Form", u"Caption");
  EXPECT_EQ(formatPropertyValue(QStringLiteral("Diga \"olá\""), caption).valueText,
            QString::fromUtf8("\"Diga \"\"olá\"\"\""));
  EXPECT_EQ(formatPropertyValue(QString(), caption).valueText, u"\"\"");

  EXPECT_EQ(formatPropertyValue(8.25f, *findPropertyInfo(u"Form", u"ScaleHeight")).valueText, u"8.25");
  EXPECT_EQ(formatPropertyValue(1264.2f, *findPropertyInfo(u"Form", u"ScaleHeight")).valueText, u"1264.2");
  EXPECT_EQ(formatPropertyValue(3195.0f, *findPropertyInfo(u"Form", u"ClientHeight")).valueText, u"3195");
  EXPECT_EQ(formatPropertyValue(qint16(-5), *findPropertyInfo(u"TextBox", u"TabIndex")).valueText, u"-5");
  EXPECT_EQ(formatPropertyValue(qint32(40), *findPropertyInfo(u"TextBox", u"MaxLength")).valueText, u"40");

  const PropertyInfo untyped = propertyInfoOrUntyped(u"Threed.SSPanel", u"Caption");
  EXPECT_EQ(formatPropertyValue(QStringLiteral("x"), untyped).valueText, u"\"x\"");
  EXPECT_EQ(formatPropertyValue(qint32(7), untyped).valueText, u"7");
  EXPECT_EQ(formatPropertyValue(true, untyped).comment, u"'True");
  EXPECT_EQ(formatPropertyValue(2.5, untyped).valueText, u"2.5");
}

TEST(PropertyValueTest, FormattedLinesReadBackAsTheSameValue) {
  struct Case {
    const char* className;
    const char* property;
    QVariant value;
    const char* line;
  };
  const std::vector<Case> cases = {
      {"Form", "BorderStyle", qint32(3), "   BorderStyle     =   3  'Fixed Dialog"},
      {"Form", "MaxButton", false, "   MaxButton       =   0   'False"},
      {"Form", "KeyPreview", true, "   KeyPreview      =   -1  'True"},
      {"Form", "BackColor", qint32(0x00C0C0C0), "   BackColor       =   &H00C0C0C0&"},
      {"Form", "Caption", QStringLiteral("Pedido n\u00BA 1"), "   Caption         =   \"Pedido n\u00BA 1\""},
      {"Form", "ScaleWidth", 4680.5f, "   ScaleWidth      =   4680.5"},
      {"TextBox", "ScrollBars", qint32(2), "   ScrollBars      =   2  'Vertical"},
      {"MSComctlLib.ListView", "View", qint32(3), "   View            =   3"},
  };
  for (const Case& sample : cases) {
    const PropertyInfo& info =
        *findPropertyInfo(QString::fromLatin1(sample.className), QString::fromLatin1(sample.property));
    const FormattedValue formatted = formatPropertyValue(sample.value, info);
    EXPECT_EQ(composePropertyLine(u"   ", info.name, formatted.valueText, formatted.comment),
              QString::fromUtf8(sample.line));
    EXPECT_EQ(parsePropertyValue(formatted.valueText, info.type), sample.value) << sample.property;
  }
}

// --- Converting assigned values --------------------------------------------------------------------------

TEST(PropertyValueTest, ConvertsAssignedValues) {
  EXPECT_EQ(convertPropertyValue(QStringLiteral("5"), PropertyType::Long), QVariant(qint32(5)));
  EXPECT_EQ(convertPropertyValue(QStringLiteral(" 5 "), PropertyType::Long), QVariant(qint32(5)));
  EXPECT_EQ(convertPropertyValue(QStringLiteral("&HFF"), PropertyType::Long), QVariant(qint32(255)));
  EXPECT_FALSE(convertPropertyValue(QStringLiteral("abc"), PropertyType::Long).has_value());
  EXPECT_FALSE(convertPropertyValue(QStringLiteral("5abc"), PropertyType::Long).has_value());
  EXPECT_FALSE(convertPropertyValue(QVariant(), PropertyType::Long).has_value());
  EXPECT_EQ(convertPropertyValue(7.6, PropertyType::Long), QVariant(qint32(8)));

  // VB rounds halves to even.
  EXPECT_EQ(convertPropertyValue(2.5, PropertyType::Integer), QVariant::fromValue(qint16(2)));
  EXPECT_EQ(convertPropertyValue(3.5, PropertyType::Integer), QVariant::fromValue(qint16(4)));
  EXPECT_EQ(convertPropertyValue(-2.5, PropertyType::Integer), QVariant::fromValue(qint16(-2)));
  EXPECT_EQ(convertPropertyValue(32767, PropertyType::Integer), QVariant::fromValue(qint16(32767)));
  EXPECT_FALSE(convertPropertyValue(40000, PropertyType::Integer).has_value()) << "overflow";
  EXPECT_FALSE(convertPropertyValue(qint64(1) << 40, PropertyType::Long).has_value());
  EXPECT_EQ(convertPropertyValue(true, PropertyType::Integer), QVariant::fromValue(qint16(-1)));

  EXPECT_EQ(convertPropertyValue(5, PropertyType::Boolean), QVariant(true));
  EXPECT_EQ(convertPropertyValue(-0.5, PropertyType::Boolean), QVariant(true));
  EXPECT_EQ(convertPropertyValue(0, PropertyType::Boolean), QVariant(false));
  EXPECT_EQ(convertPropertyValue(QStringLiteral("true"), PropertyType::Boolean), QVariant(true));
  EXPECT_EQ(convertPropertyValue(QStringLiteral("False"), PropertyType::Boolean), QVariant(false));
  EXPECT_EQ(convertPropertyValue(QStringLiteral("2"), PropertyType::Boolean), QVariant(true));
  EXPECT_FALSE(convertPropertyValue(QStringLiteral("sim"), PropertyType::Boolean).has_value());

  EXPECT_EQ(convertPropertyValue(42, PropertyType::String), QVariant(QStringLiteral("42")));
  EXPECT_EQ(convertPropertyValue(true, PropertyType::String), QVariant(QStringLiteral("True")));
  EXPECT_EQ(convertPropertyValue(1.5, PropertyType::String), QVariant(QStringLiteral("1.5")));
  EXPECT_EQ(convertPropertyValue(QStringLiteral("x"), PropertyType::String), QVariant(QStringLiteral("x")));

  const std::optional<QVariant> single = convertPropertyValue(QStringLiteral("8.25"), PropertyType::Single);
  ASSERT_TRUE(single.has_value());
  EXPECT_EQ(single->typeId(), QMetaType::Float);
  EXPECT_FLOAT_EQ(single->toFloat(), 8.25f);
  EXPECT_FALSE(convertPropertyValue(1e300, PropertyType::Single).has_value());
  EXPECT_EQ(convertPropertyValue(QStringLiteral("1e3"), PropertyType::Double), QVariant(1000.0));

  EXPECT_EQ(convertPropertyValue(QStringLiteral("&H8000000F&"), PropertyType::Color),
            QVariant(qint32(0x8000000F)));
  EXPECT_EQ(convertPropertyValue(QStringLiteral("anything"), PropertyType::Untyped),
            QVariant(QStringLiteral("anything")));
}

TEST(PropertyValueTest, EnumeratedAssignmentsMustBeListed) {
  const PropertyInfo& position = *findPropertyInfo(u"Form", u"StartUpPosition");
  EXPECT_EQ(convertPropertyValue(2, position), QVariant(qint32(2)));
  EXPECT_EQ(convertPropertyValue(QStringLiteral("3"), position), QVariant(qint32(3)));
  EXPECT_FALSE(convertPropertyValue(4, position).has_value());
  EXPECT_FALSE(convertPropertyValue(-1, position).has_value());
  // Other types convert as their type alone says.
  EXPECT_EQ(convertPropertyValue(QStringLiteral("9"), *findPropertyInfo(u"Timer", u"Interval")),
            QVariant(qint32(9)));
}

}  // namespace
}  // namespace host
