// SPDX-License-Identifier: MIT
// The property tables of the intrinsic controls, built once on first use, and the value conversions.
// Value names are the ones the IDE writes after the apostrophe in saved form descriptions; defaults are the
// documented ones. Where a table holds a value that neither could confirm, a comment says so.
#include "host/files/controlclasses.h"

#include "host/files/vbliteral.h"

#include <QLocale>

#include <algorithm>
#include <array>
#include <cmath>
#include <limits>

namespace host {
namespace {

// --- Value names -----------------------------------------------------------------------------------------

constexpr std::array<EnumValue, 2> kAppearance = {{{0, "Flat"}, {1, "3D"}}};
constexpr std::array<EnumValue, 2> kNoneFixedSingle = {{{0, "None"}, {1, "Fixed Single"}}};
constexpr std::array<EnumValue, 6> kFormBorderStyle = {{{0, "None"},
                                                        {1, "Fixed Single"},
                                                        {2, "Sizable"},
                                                        {3, "Fixed Dialog"},
                                                        {4, "Fixed ToolWindow"},
                                                        {5, "Sizable ToolWindow"}}};
constexpr std::array<EnumValue, 7> kLineBorderStyle = {{{0, "Transparent"},
                                                        {1, "Solid"},
                                                        {2, "Dash"},
                                                        {3, "Dot"},
                                                        {4, "Dash-Dot"},
                                                        {5, "Dash-Dot-Dot"},
                                                        {6, "Inside Solid"}}};
constexpr std::array<EnumValue, 4> kStartUpPosition = {
    {{0, "Manual"}, {1, "CenterOwner"}, {2, "CenterScreen"}, {3, "Windows Default"}}};
constexpr std::array<EnumValue, 3> kWindowState = {{{0, "Normal"}, {1, "Minimized"}, {2, "Maximized"}}};
constexpr std::array<EnumValue, 8> kScaleMode = {{{0, "User"},
                                                  {1, "Twip"},
                                                  {2, "Point"},
                                                  {3, "Pixel"},
                                                  {4, "Character"},
                                                  {5, "Inch"},
                                                  {6, "Millimeter"},
                                                  {7, "Centimeter"}}};
constexpr std::array<EnumValue, 17> kMousePointer = {{{0, "Default"},
                                                      {1, "Arrow"},
                                                      {2, "Cross"},
                                                      {3, "I-Beam"},
                                                      {4, "Icon"},
                                                      {5, "Size"},
                                                      {6, "Size NE SW"},
                                                      {7, "Size N S"},
                                                      {8, "Size NW SE"},
                                                      {9, "Size W E"},
                                                      {10, "Up Arrow"},
                                                      {11, "Hourglass"},
                                                      {12, "No Drop"},
                                                      {13, "Arrow and Hourglass"},
                                                      {14, "Arrow and Question"},
                                                      {15, "Size All"},
                                                      {99, "Custom"}}};
constexpr std::array<EnumValue, 2> kDragMode = {{{0, "Manual"}, {1, "Automatic"}}};
constexpr std::array<EnumValue, 2> kOleDragMode = {{{0, "Manual"}, {1, "Automatic"}}};
constexpr std::array<EnumValue, 2> kOleDropModeNoneManual = {{{0, "None"}, {1, "Manual"}}};
constexpr std::array<EnumValue, 3> kOleDropModeWithAutomatic = {
    {{0, "None"}, {1, "Manual"}, {2, "Automatic"}}};
constexpr std::array<EnumValue, 2> kFormLinkMode = {{{0, "None"}, {1, "Source"}}};
// The documented names; saved files with these values were not found to confirm them.
constexpr std::array<EnumValue, 4> kControlLinkMode = {
    {{0, "None"}, {1, "Automatic"}, {2, "Manual"}, {3, "Notify"}}};
constexpr std::array<EnumValue, 3> kTextAlignment = {
    {{0, "Left Justify"}, {1, "Right Justify"}, {2, "Center"}}};
constexpr std::array<EnumValue, 2> kCheckAlignment = {{{0, "Left Justify"}, {1, "Right Justify"}}};
constexpr std::array<EnumValue, 4> kTextScrollBars = {
    {{0, "None"}, {1, "Horizontal"}, {2, "Vertical"}, {3, "Both"}}};
constexpr std::array<EnumValue, 2> kButtonStyle = {{{0, "Standard"}, {1, "Graphical"}}};
constexpr std::array<EnumValue, 3> kComboStyle = {
    {{0, "Dropdown Combo"}, {1, "Simple Combo"}, {2, "Dropdown List"}}};
constexpr std::array<EnumValue, 2> kListStyle = {{{0, "Standard"}, {1, "Checkbox"}}};
constexpr std::array<EnumValue, 3> kMultiSelect = {{{0, "None"}, {1, "Simple"}, {2, "Extended"}}};
constexpr std::array<EnumValue, 2> kBackStyle = {{{0, "Transparent"}, {1, "Opaque"}}};
constexpr std::array<EnumValue, 3> kCheckValue = {{{0, "Unchecked"}, {1, "Checked"}, {2, "Grayed"}}};
constexpr std::array<EnumValue, 5> kAlign = {
    {{0, "None"}, {1, "Align Top"}, {2, "Align Bottom"}, {3, "Align Left"}, {4, "Align Right"}}};
constexpr std::array<EnumValue, 6> kShape = {{{0, "Rectangle"},
                                              {1, "Square"},
                                              {2, "Oval"},
                                              {3, "Circle"},
                                              {4, "Rounded Rectangle"},
                                              {5, "Rounded Square"}}};
constexpr std::array<EnumValue, 8> kFillStyle = {{{0, "Solid"},
                                                  {1, "Transparent"},
                                                  {2, "Horizontal Line"},
                                                  {3, "Vertical Line"},
                                                  {4, "Upward Diagonal"},
                                                  {5, "Downward Diagonal"},
                                                  {6, "Cross"},
                                                  {7, "Diagonal Cross"}}};
constexpr std::array<EnumValue, 7> kDrawStyle = {{{0, "Solid"},
                                                  {1, "Dash"},
                                                  {2, "Dot"},
                                                  {3, "Dash-Dot"},
                                                  {4, "Dash-Dot-Dot"},
                                                  {5, "Transparent"},
                                                  {6, "Inside Solid"}}};
// Saved files name each DrawMode value after its predecessor ("7  'Invert", "16  'Merge Pen"), and 1 as
// Blackness; the table reproduces what the IDE writes, not the documented meaning.
constexpr std::array<EnumValue, 16> kDrawMode = {{{1, "Blackness"},
                                                  {2, "Blackness"},
                                                  {3, "Not Merge Pen"},
                                                  {4, "Mask Not Pen"},
                                                  {5, "Not Copy Pen"},
                                                  {6, "Mask Pen Not"},
                                                  {7, "Invert"},
                                                  {8, "Xor Pen"},
                                                  {9, "Not Mask Pen"},
                                                  {10, "Mask Pen"},
                                                  {11, "Not Xor Pen"},
                                                  {12, "Nop"},
                                                  {13, "Merge Not Pen"},
                                                  {14, "Copy Pen"},
                                                  {15, "Merge Pen Not"},
                                                  {16, "Merge Pen"}}};
// "Custom" for 2 is the documented name; only 1 'UseZOrder was confirmed in saved files.
constexpr std::array<EnumValue, 3> kPaletteMode = {{{0, "Halftone"}, {1, "UseZOrder"}, {2, "Custom"}}};
constexpr std::array<EnumValue, 4> kNegotiatePosition = {
    {{0, "None"}, {1, "Left"}, {2, "Middle"}, {3, "Right"}}};

// ListView (MSComctlLib): the control saves these without value names; the names are its constants.
constexpr std::array<EnumValue, 4> kListViewView = {
    {{0, "lvwIcon"}, {1, "lvwSmallIcon"}, {2, "lvwList"}, {3, "lvwReport"}}};
constexpr std::array<EnumValue, 2> kListViewLabelEdit = {{{0, "lvwAutomatic"}, {1, "lvwManual"}}};
constexpr std::array<EnumValue, 2> kListViewSortOrder = {{{0, "lvwAscending"}, {1, "lvwDescending"}}};
constexpr std::array<EnumValue, 2> kListViewAppearance = {{{0, "ccFlat"}, {1, "cc3D"}}};
constexpr std::array<EnumValue, 2> kListViewBorderStyle = {{{0, "ccNone"}, {1, "ccFixedSingle"}}};
constexpr std::array<EnumValue, 2> kListViewOleDragMode = {
    {{0, "ccOLEDragManual"}, {1, "ccOLEDragAutomatic"}}};
constexpr std::array<EnumValue, 2> kListViewOleDropMode = {{{0, "ccOLEDropNone"}, {1, "ccOLEDropManual"}}};
constexpr std::array<EnumValue, 2> kListViewTextBackground = {{{0, "lvwTransparent"}, {1, "lvwOpaque"}}};

// System colours as the IDE writes them.
constexpr quint32 kButtonFace = 0x8000000F;
constexpr quint32 kButtonText = 0x80000012;
constexpr quint32 kWindowBackground = 0x80000005;
constexpr quint32 kWindowText = 0x80000008;
constexpr quint32 kApplicationWorkspace = 0x8000000C;
constexpr quint32 kMaskGray = 0x00C0C0C0;

// --- Table builders --------------------------------------------------------------------------------------

PropertyInfo makeProperty(const char* name, PropertyType type, QVariant defaultValue) {
  PropertyInfo info;
  info.name = QString::fromLatin1(name);
  info.type = type;
  info.defaultValue = std::move(defaultValue);
  return info;
}

PropertyInfo text(const char* name, const char* defaultValue = "") {
  return makeProperty(name, PropertyType::String, QString::fromLatin1(defaultValue));
}
PropertyInfo boolean(const char* name, bool defaultValue) {
  return makeProperty(name, PropertyType::Boolean, defaultValue);
}
PropertyInfo integer(const char* name, qint16 defaultValue) {
  return makeProperty(name, PropertyType::Integer, QVariant::fromValue(defaultValue));
}
PropertyInfo longValue(const char* name, qint32 defaultValue) {
  return makeProperty(name, PropertyType::Long, QVariant::fromValue(defaultValue));
}
PropertyInfo single(const char* name, float defaultValue = 0.0f) {
  return makeProperty(name, PropertyType::Single, QVariant::fromValue(defaultValue));
}
PropertyInfo color(const char* name, quint32 defaultValue) {
  return makeProperty(name, PropertyType::Color, QVariant::fromValue(static_cast<qint32>(defaultValue)));
}
template <std::size_t N>
PropertyInfo enumerated(const char* name, qint32 defaultValue, const std::array<EnumValue, N>& names,
                        bool writesValueName = true) {
  PropertyInfo info = makeProperty(name, PropertyType::Enumerated, QVariant::fromValue(defaultValue));
  info.valueNames = names;
  info.writesValueName = writesValueName;
  return info;
}
/// A property whose value lives in the .frx (pictures, list items) or has no default to report.
PropertyInfo untyped(const char* name) {
  return makeProperty(name, PropertyType::Untyped, QVariant());
}
PropertyInfo withoutDefault(const char* name, PropertyType type) {
  return makeProperty(name, type, QVariant());
}

using Properties = std::vector<PropertyInfo>;

void add(Properties& to, std::initializer_list<PropertyInfo> properties) {
  to.insert(to.end(), properties.begin(), properties.end());
}

/// Name, Index, Tag: every control has them.
Properties identity() {
  return {withoutDefault("Name", PropertyType::String), withoutDefault("Index", PropertyType::Integer),
          text("Tag")};
}
/// Forms cannot be control array elements.
Properties formIdentity() {
  return {withoutDefault("Name", PropertyType::String), text("Tag")};
}
Properties placement() {
  return {single("Left"), single("Top"), single("Width"), single("Height")};
}
/// What a visible control that can take the focus shares.
Properties focusable() {
  return {integer("TabIndex", 0),
          boolean("TabStop", true),
          boolean("Visible", true),
          boolean("Enabled", true),
          text("ToolTipText"),
          enumerated("DragMode", 0, kDragMode),
          untyped("DragIcon"),
          enumerated("MousePointer", 0, kMousePointer),
          untyped("MouseIcon"),
          longValue("HelpContextID", 0),
          longValue("WhatsThisHelpID", 0),
          boolean("CausesValidation", true),
          boolean("RightToLeft", false)};
}
Properties fontAndAppearance() {
  return {untyped("Font"), enumerated("Appearance", 1, kAppearance)};
}
Properties drawing() {
  return {boolean("AutoRedraw", false),
          boolean("ClipControls", true),
          enumerated("DrawMode", 13, kDrawMode),
          enumerated("DrawStyle", 0, kDrawStyle),
          integer("DrawWidth", 1),
          color("FillColor", 0),
          enumerated("FillStyle", 1, kFillStyle),
          boolean("FontTransparent", true),
          boolean("HasDC", true),
          untyped("Picture"),
          single("ScaleHeight"),
          single("ScaleLeft"),
          enumerated("ScaleMode", 1, kScaleMode),
          single("ScaleTop"),
          single("ScaleWidth")};
}
Properties clientArea() {
  return {single("ClientHeight"), single("ClientLeft"), single("ClientTop"), single("ClientWidth")};
}
Properties dde(bool form) {
  if (form) return {enumerated("LinkMode", 0, kFormLinkMode), text("LinkTopic")};
  return {text("LinkItem"), enumerated("LinkMode", 0, kControlLinkMode), integer("LinkTimeout", 50),
          text("LinkTopic")};
}

ControlClassInfo makeClass(const char* className, std::initializer_list<Properties> parts) {
  ControlClassInfo info;
  info.className = QString::fromLatin1(className);
  for (const Properties& part : parts)
    info.properties.insert(info.properties.end(), part.begin(), part.end());
  return info;
}

std::vector<ControlClassInfo> buildClasses() {
  std::vector<ControlClassInfo> classes;

  ControlClassInfo form = makeClass(
      "VB.Form", {formIdentity(), placement(), clientArea(), fontAndAppearance(), drawing(), dde(true)});
  add(form.properties, {color("BackColor", kButtonFace),
                        color("ForeColor", kButtonText),
                        enumerated("BorderStyle", 2, kFormBorderStyle),
                        text("Caption"),
                        boolean("ControlBox", true),
                        boolean("Enabled", true),
                        untyped("Icon"),
                        boolean("KeyPreview", false),
                        boolean("LockControls", false),
                        boolean("MaxButton", true),
                        boolean("MDIChild", false),
                        boolean("MinButton", true),
                        enumerated("MousePointer", 0, kMousePointer),
                        untyped("MouseIcon"),
                        boolean("Moveable", true),
                        boolean("NegotiateMenus", true),
                        enumerated("OLEDropMode", 0, kOleDropModeNoneManual),
                        untyped("Palette"),
                        enumerated("PaletteMode", 0, kPaletteMode),
                        boolean("RightToLeft", false),
                        boolean("ShowInTaskbar", true),
                        enumerated("StartUpPosition", 0, kStartUpPosition),
                        boolean("Visible", true),
                        boolean("WhatsThisButton", false),
                        boolean("WhatsThisHelp", false),
                        enumerated("WindowState", 0, kWindowState)});
  classes.push_back(std::move(form));

  ControlClassInfo mdiForm = makeClass("VB.MDIForm", {formIdentity(), placement(), clientArea(), dde(true)});
  add(mdiForm.properties,
      {enumerated("Appearance", 1, kAppearance), boolean("AutoShowChildren", true),
       color("BackColor", kApplicationWorkspace), text("Caption"), boolean("Enabled", true), untyped("Icon"),
       enumerated("MousePointer", 0, kMousePointer), untyped("MouseIcon"), boolean("Moveable", true),
       boolean("NegotiateToolbars", true), enumerated("OLEDropMode", 0, kOleDropModeNoneManual),
       untyped("Picture"), boolean("RightToLeft", false), boolean("ScrollBars", true),
       enumerated("StartUpPosition", 0, kStartUpPosition), boolean("Visible", true),
       boolean("WhatsThisHelp", false), enumerated("WindowState", 0, kWindowState)});
  classes.push_back(std::move(mdiForm));

  ControlClassInfo textBox =
      makeClass("VB.TextBox", {identity(), placement(), focusable(), fontAndAppearance(), dde(false)});
  add(textBox.properties,
      {enumerated("Alignment", 0, kTextAlignment), color("BackColor", kWindowBackground),
       enumerated("BorderStyle", 1, kNoneFixedSingle), color("ForeColor", kWindowText),
       boolean("HideSelection", true), boolean("Locked", false), longValue("MaxLength", 0),
       boolean("MultiLine", false), enumerated("OLEDragMode", 0, kOleDragMode),
       enumerated("OLEDropMode", 0, kOleDropModeWithAutomatic), text("PasswordChar"),
       enumerated("ScrollBars", 0, kTextScrollBars), text("Text")});
  classes.push_back(std::move(textBox));

  ControlClassInfo commandButton =
      makeClass("VB.CommandButton", {identity(), placement(), focusable(), fontAndAppearance()});
  add(commandButton.properties,
      {color("BackColor", kButtonFace), boolean("Cancel", false), text("Caption"), boolean("Default", false),
       untyped("DisabledPicture"), untyped("DownPicture"), color("MaskColor", kMaskGray),
       enumerated("OLEDropMode", 0, kOleDropModeNoneManual), untyped("Picture"),
       enumerated("Style", 0, kButtonStyle), boolean("UseMaskColor", false), boolean("Value", false)});
  classes.push_back(std::move(commandButton));

  // A Label takes no focus: it has a TabIndex but no TabStop.
  ControlClassInfo label = makeClass("VB.Label", {identity(), placement(), fontAndAppearance(), dde(false)});
  add(label.properties, {enumerated("Alignment", 0, kTextAlignment),
                         boolean("AutoSize", false),
                         color("BackColor", kButtonFace),
                         enumerated("BackStyle", 1, kBackStyle),
                         enumerated("BorderStyle", 0, kNoneFixedSingle),
                         text("Caption"),
                         enumerated("DragMode", 0, kDragMode),
                         untyped("DragIcon"),
                         boolean("Enabled", true),
                         color("ForeColor", kButtonText),
                         enumerated("MousePointer", 0, kMousePointer),
                         untyped("MouseIcon"),
                         enumerated("OLEDropMode", 0, kOleDropModeNoneManual),
                         boolean("RightToLeft", false),
                         integer("TabIndex", 0),
                         text("ToolTipText"),
                         boolean("UseMnemonic", true),
                         boolean("Visible", true),
                         longValue("WhatsThisHelpID", 0),
                         boolean("WordWrap", false)});
  classes.push_back(std::move(label));

  ControlClassInfo comboBox =
      makeClass("VB.ComboBox", {identity(), placement(), focusable(), fontAndAppearance()});
  add(comboBox.properties,
      {color("BackColor", kWindowBackground), color("ForeColor", kWindowText),
       boolean("IntegralHeight", true), untyped("ItemData"), untyped("List"), boolean("Locked", false),
       enumerated("OLEDragMode", 0, kOleDragMode), enumerated("OLEDropMode", 0, kOleDropModeNoneManual),
       boolean("Sorted", false), enumerated("Style", 0, kComboStyle), text("Text")});
  classes.push_back(std::move(comboBox));

  ControlClassInfo listBox =
      makeClass("VB.ListBox", {identity(), placement(), focusable(), fontAndAppearance()});
  add(listBox.properties,
      {color("BackColor", kWindowBackground), integer("Columns", 0), color("ForeColor", kWindowText),
       boolean("IntegralHeight", true), untyped("ItemData"), untyped("List"),
       enumerated("MultiSelect", 0, kMultiSelect), enumerated("OLEDragMode", 0, kOleDragMode),
       enumerated("OLEDropMode", 0, kOleDropModeNoneManual), boolean("Sorted", false),
       enumerated("Style", 0, kListStyle)});
  classes.push_back(std::move(listBox));

  ControlClassInfo frame = makeClass("VB.Frame", {identity(), placement(), fontAndAppearance()});
  add(frame.properties, {color("BackColor", kButtonFace), enumerated("BorderStyle", 1, kNoneFixedSingle),
                         text("Caption"), boolean("ClipControls", true), enumerated("DragMode", 0, kDragMode),
                         untyped("DragIcon"), boolean("Enabled", true), color("ForeColor", kButtonText),
                         longValue("HelpContextID", 0), enumerated("MousePointer", 0, kMousePointer),
                         untyped("MouseIcon"), enumerated("OLEDropMode", 0, kOleDropModeNoneManual),
                         boolean("RightToLeft", false), integer("TabIndex", 0), text("ToolTipText"),
                         boolean("Visible", true), longValue("WhatsThisHelpID", 0)});
  classes.push_back(std::move(frame));

  classes.push_back(makeClass(
      "VB.Timer",
      {identity(), {single("Left"), single("Top"), boolean("Enabled", true), longValue("Interval", 0)}}));

  const auto checkLike = [](const char* className, PropertyInfo value) {
    ControlClassInfo info = makeClass(className, {identity(), placement(), focusable(), fontAndAppearance()});
    add(info.properties,
        {enumerated("Alignment", 0, kCheckAlignment), color("BackColor", kButtonFace), text("Caption"),
         untyped("DisabledPicture"), untyped("DownPicture"), color("ForeColor", kButtonText),
         color("MaskColor", kMaskGray), enumerated("OLEDropMode", 0, kOleDropModeNoneManual),
         untyped("Picture"), enumerated("Style", 0, kButtonStyle), boolean("UseMaskColor", false),
         std::move(value)});
    return info;
  };
  classes.push_back(checkLike("VB.CheckBox", enumerated("Value", 0, kCheckValue)));
  classes.push_back(checkLike("VB.OptionButton", boolean("Value", false)));

  ControlClassInfo pictureBox = makeClass(
      "VB.PictureBox", {identity(), placement(), focusable(), fontAndAppearance(), drawing(), dde(false)});
  add(pictureBox.properties,
      {enumerated("Align", 0, kAlign), boolean("AutoSize", false), color("BackColor", kButtonFace),
       enumerated("BorderStyle", 1, kNoneFixedSingle), color("ForeColor", kButtonText),
       boolean("Negotiate", false), enumerated("OLEDragMode", 0, kOleDragMode),
       enumerated("OLEDropMode", 0, kOleDropModeNoneManual)});
  classes.push_back(std::move(pictureBox));

  ControlClassInfo image = makeClass("VB.Image", {identity(), placement()});
  add(image.properties,
      {enumerated("Appearance", 1, kAppearance), enumerated("BorderStyle", 0, kNoneFixedSingle),
       enumerated("DragMode", 0, kDragMode), untyped("DragIcon"), boolean("Enabled", true),
       enumerated("MousePointer", 0, kMousePointer), untyped("MouseIcon"),
       enumerated("OLEDragMode", 0, kOleDragMode), enumerated("OLEDropMode", 0, kOleDropModeNoneManual),
       untyped("Picture"), boolean("Stretch", false), text("ToolTipText"), boolean("Visible", true),
       longValue("WhatsThisHelpID", 0)});
  classes.push_back(std::move(image));

  classes.push_back(makeClass(
      "VB.Menu", {identity(),
                  {text("Caption"), boolean("Checked", false), boolean("Enabled", true),
                   longValue("HelpContextID", 0), enumerated("NegotiatePosition", 0, kNegotiatePosition),
                   // Written as keys ("^S", "{F1}"), not numbers.
                   untyped("Shortcut"), boolean("Visible", true), boolean("WindowList", false)}}));

  for (const char* scrollBar : {"VB.HScrollBar", "VB.VScrollBar"}) {
    ControlClassInfo info = makeClass(scrollBar, {identity(), placement(), focusable()});
    add(info.properties, {integer("LargeChange", 1), integer("Max", 32767), integer("Min", 0),
                          integer("SmallChange", 1), integer("Value", 0)});
    classes.push_back(std::move(info));
  }

  ControlClassInfo shape = makeClass("VB.Shape", {identity(), placement()});
  add(shape.properties,
      {color("BackColor", kWindowBackground), enumerated("BackStyle", 0, kBackStyle),
       color("BorderColor", kWindowText), enumerated("BorderStyle", 1, kLineBorderStyle),
       integer("BorderWidth", 1), enumerated("DrawMode", 13, kDrawMode), color("FillColor", 0),
       enumerated("FillStyle", 1, kFillStyle), enumerated("Shape", 0, kShape), boolean("Visible", true)});
  classes.push_back(std::move(shape));

  classes.push_back(makeClass(
      "VB.Line", {identity(),
                  {color("BorderColor", kWindowText), enumerated("BorderStyle", 1, kLineBorderStyle),
                   integer("BorderWidth", 1), enumerated("DrawMode", 13, kDrawMode), boolean("Visible", true),
                   single("X1"), single("X2"), single("Y1"), single("Y2")}}));

  const auto fileSystemList = [](const char* className) {
    ControlClassInfo info = makeClass(className, {identity(), placement(), focusable(), fontAndAppearance()});
    add(info.properties, {color("BackColor", kWindowBackground), color("ForeColor", kWindowText),
                          enumerated("OLEDropMode", 0, kOleDropModeNoneManual)});
    return info;
  };
  classes.push_back(fileSystemList("VB.DriveListBox"));
  ControlClassInfo dirListBox = fileSystemList("VB.DirListBox");
  add(dirListBox.properties, {enumerated("OLEDragMode", 0, kOleDragMode)});
  classes.push_back(std::move(dirListBox));
  ControlClassInfo fileListBox = fileSystemList("VB.FileListBox");
  add(fileListBox.properties,
      {boolean("Archive", true), boolean("Hidden", false), enumerated("MultiSelect", 0, kMultiSelect),
       boolean("Normal", true), enumerated("OLEDragMode", 0, kOleDragMode), text("Pattern", "*.*"),
       boolean("ReadOnly", true), boolean("System", false)});
  classes.push_back(std::move(fileListBox));

  // The ListView saves its own properties through its property bag: colours as plain decimal Longs and
  // enumerations without value names. The extender's (Left, TabIndex, Visible ...) are written by the IDE.
  ControlClassInfo listView = makeClass("MSComctlLib.ListView", {identity(), placement(), focusable()});
  add(listView.properties, {longValue("_ExtentX", 0),
                            longValue("_ExtentY", 0),
                            longValue("_Version", 393217),
                            boolean("AllowReorder", false),
                            enumerated("Appearance", 1, kListViewAppearance, false),
                            longValue("BackColor", static_cast<qint32>(kWindowBackground)),
                            enumerated("BorderStyle", 0, kListViewBorderStyle, false),
                            boolean("Checkboxes", false),
                            text("ColumnHeaderIcons"),
                            boolean("FlatScrollBar", false),
                            longValue("ForeColor", static_cast<qint32>(kWindowText)),
                            boolean("FullRowSelect", false),
                            boolean("GridLines", false),
                            boolean("HideColumnHeaders", false),
                            boolean("HideSelection", true),
                            boolean("HotTracking", false),
                            boolean("HoverSelection", false),
                            text("Icons"),
                            enumerated("LabelEdit", 0, kListViewLabelEdit, false),
                            boolean("LabelWrap", true),
                            boolean("MultiSelect", false),
                            integer("NumItems", 0),
                            enumerated("OLEDragMode", 0, kListViewOleDragMode, false),
                            enumerated("OLEDropMode", 0, kListViewOleDropMode, false),
                            untyped("Picture"),
                            text("SmallIcons"),
                            boolean("Sorted", false),
                            integer("SortKey", 0),
                            enumerated("SortOrder", 0, kListViewSortOrder, false),
                            enumerated("TextBackground", 0, kListViewTextBackground, false),
                            enumerated("View", 0, kListViewView, false)});
  // Its MousePointer is the control's own: saved without a value name.
  for (PropertyInfo& property : listView.properties) {
    if (property.name == u"MousePointer") property.writesValueName = false;
  }
  classes.push_back(std::move(listView));

  // Later entries of a class override earlier ones of the same name (a class's own BackColor over a shared
  // group's); keep the last.
  for (ControlClassInfo& info : classes) {
    Properties unique;
    for (auto it = info.properties.rbegin(); it != info.properties.rend(); ++it) {
      const bool seen = std::any_of(unique.begin(), unique.end(), [&](const PropertyInfo& kept) {
        return kept.name.compare(it->name, Qt::CaseInsensitive) == 0;
      });
      if (!seen) unique.push_back(*it);
    }
    info.properties.assign(unique.rbegin(), unique.rend());
  }
  return classes;
}

const std::vector<ControlClassInfo>& controlClasses() {
  static const std::vector<ControlClassInfo> classes = buildClasses();
  return classes;
}

// --- Value conversions -----------------------------------------------------------------------------------

/// Integer text: decimal, or &H / &O with an optional type suffix (&, %).
std::optional<qint64> parseIntegerText(QStringView text) {
  text = text.trimmed();
  if (text.isEmpty()) return std::nullopt;
  bool valid = false;
  if (text.startsWith(u'&') && text.size() > 2) {
    const QChar radixLetter = text[1].toUpper();
    const int radix = radixLetter == u'H' ? 16 : radixLetter == u'O' ? 8 : 0;
    if (radix == 0) return std::nullopt;
    QStringView digits = text.mid(2);
    if (digits.endsWith(u'&') || digits.endsWith(u'%')) digits.chop(1);
    const quint64 value = digits.toULongLong(&valid, radix);
    if (!valid || digits.isEmpty()) return std::nullopt;
    // &H literals are two's complement: &HFFFF& and &H8000000F& are Longs with the high bit set.
    if (value > 0xFFFFFFFFull) return std::nullopt;
    return static_cast<qint64>(static_cast<qint32>(static_cast<quint32>(value)));
  }
  const qint64 value = text.toLongLong(&valid);
  if (!valid) return std::nullopt;
  return value;
}

/// Decimal text; saved files from some locales use a comma as the decimal separator.
std::optional<double> parseDecimalText(QStringView text) {
  text = text.trimmed();
  if (text.isEmpty()) return std::nullopt;
  bool valid = false;
  double value = QLocale::c().toDouble(text, &valid);
  if (!valid && text.contains(u',') && !text.contains(u'.')) {
    value = QLocale::c().toDouble(text.toString().replace(u',', u'.'), &valid);
  }
  if (!valid) return std::nullopt;
  return value;
}

std::optional<double> numericText(QStringView text) {
  if (const std::optional<qint64> integer = parseIntegerText(text)) return static_cast<double>(*integer);
  return parseDecimalText(text);
}

/// VB rounds to the nearest integer and halves to even (CInt(2.5) = 2).
double roundHalfToEven(double value) {
  return std::nearbyint(value);
}

std::optional<double> numericValue(const QVariant& value) {
  switch (value.typeId()) {
    case QMetaType::Bool:
      return value.toBool() ? -1.0 : 0.0;
    case QMetaType::QString: {
      const QString text = value.toString().trimmed();
      if (text.compare(u"True", Qt::CaseInsensitive) == 0) return -1.0;
      if (text.compare(u"False", Qt::CaseInsensitive) == 0) return 0.0;
      return numericText(text);
    }
    case QMetaType::Short:
    case QMetaType::UShort:
    case QMetaType::Int:
    case QMetaType::UInt:
    case QMetaType::Long:
    case QMetaType::ULong:
    case QMetaType::LongLong:
    case QMetaType::ULongLong:
    case QMetaType::Char:
    case QMetaType::SChar:
    case QMetaType::UChar:
    case QMetaType::Float:
    case QMetaType::Double:
      return value.toDouble();
    default:
      return std::nullopt;
  }
}

bool isNumberType(const QVariant& value) {
  switch (value.typeId()) {
    case QMetaType::Short:
    case QMetaType::UShort:
    case QMetaType::Int:
    case QMetaType::UInt:
    case QMetaType::Long:
    case QMetaType::ULong:
    case QMetaType::LongLong:
    case QMetaType::ULongLong:
    case QMetaType::Char:
    case QMetaType::SChar:
    case QMetaType::UChar:
    case QMetaType::Float:
    case QMetaType::Double:
      return true;
    default:
      return false;
  }
}

QString formatSingle(float value) {
  // Seven significant digits, as VB prints a Single; exponents in VB's capital form.
  return QString::number(static_cast<double>(value), 'g', 7).toUpper();
}

QString formatDouble(double value) {
  return QString::number(value, 'g', 15).toUpper();
}

QString formatColor(qint32 value) {
  return QStringLiteral("&H%1&").arg(static_cast<quint32>(value), 8, 16, QLatin1Char('0')).toUpper();
}

FormattedValue formatBoolean(bool value) {
  return value ? FormattedValue{QStringLiteral("-1"), QStringLiteral("'True")}
               : FormattedValue{QStringLiteral("0"), QStringLiteral("'False")};
}

FormattedValue formatUntyped(const QVariant& value) {
  if (value.typeId() == QMetaType::Bool) return formatBoolean(value.toBool());
  if (value.typeId() == QMetaType::Float) return {formatSingle(value.toFloat()), {}};
  if (value.typeId() == QMetaType::Double) return {formatDouble(value.toDouble()), {}};
  if (isNumberType(value)) return {QString::number(value.toLongLong()), {}};
  return {quoteVbString(value.toString()), {}};
}

std::optional<QVariant> toRangedInteger(const QVariant& in, qint64 minimum, qint64 maximum) {
  const std::optional<double> number = numericValue(in);
  if (!number || !std::isfinite(*number)) return std::nullopt;
  const double rounded = roundHalfToEven(*number);
  if (rounded < static_cast<double>(minimum) || rounded > static_cast<double>(maximum)) return std::nullopt;
  return QVariant::fromValue(static_cast<qint64>(rounded));
}

}  // namespace

const ControlClassInfo* findControlClass(QStringView className) {
  for (const ControlClassInfo& info : controlClasses()) {
    if (info.className.compare(className, Qt::CaseInsensitive) == 0) return &info;
    // Intrinsic classes may be named without their library ("TextBox").
    if (info.className.startsWith(u"VB.") &&
        QStringView(info.className).mid(3).compare(className, Qt::CaseInsensitive) == 0) {
      return &info;
    }
  }
  return nullptr;
}

const PropertyInfo* findPropertyInfo(QStringView className, QStringView propertyName) {
  const ControlClassInfo* info = findControlClass(className);
  if (!info) return nullptr;
  for (const PropertyInfo& property : info->properties) {
    if (property.name.compare(propertyName, Qt::CaseInsensitive) == 0) return &property;
  }
  return nullptr;
}

PropertyInfo propertyInfoOrUntyped(QStringView className, QStringView propertyName) {
  if (const PropertyInfo* info = findPropertyInfo(className, propertyName)) return *info;
  PropertyInfo info;
  info.name = propertyName.toString();
  return info;
}

QString valueName(const PropertyInfo& info, qint32 value) {
  for (const EnumValue& entry : info.valueNames) {
    if (entry.value == value) return QString::fromLatin1(entry.name);
  }
  return {};
}

QVariant parsePropertyValue(QStringView text, PropertyType type) {
  text = text.trimmed();
  switch (type) {
    case PropertyType::String: {
      const std::optional<QString> value = unquoteVbString(text);
      return value ? QVariant(*value) : QVariant();
    }
    case PropertyType::Boolean: {
      const std::optional<qint64> value = parseIntegerText(text);
      return value ? QVariant(*value != 0) : QVariant();
    }
    case PropertyType::Integer: {
      const std::optional<qint64> value = parseIntegerText(text);
      if (!value || *value < std::numeric_limits<qint16>::min() ||
          *value > std::numeric_limits<qint16>::max()) {
        return {};
      }
      return QVariant::fromValue(static_cast<qint16>(*value));
    }
    case PropertyType::Long:
    case PropertyType::Color:
    case PropertyType::Enumerated: {
      const std::optional<qint64> value = parseIntegerText(text);
      if (!value || *value < std::numeric_limits<qint32>::min() ||
          *value > std::numeric_limits<qint32>::max()) {
        return {};
      }
      return QVariant::fromValue(static_cast<qint32>(*value));
    }
    case PropertyType::Single: {
      const std::optional<double> value = parseDecimalText(text);
      return value ? QVariant::fromValue(static_cast<float>(*value)) : QVariant();
    }
    case PropertyType::Double: {
      const std::optional<double> value = parseDecimalText(text);
      return value ? QVariant::fromValue(*value) : QVariant();
    }
    case PropertyType::Untyped:
      break;
  }
  if (const std::optional<QString> string = unquoteVbString(text)) return *string;
  if (const std::optional<qint64> integer = parseIntegerText(text)) {
    if (*integer >= std::numeric_limits<qint32>::min() && *integer <= std::numeric_limits<qint32>::max()) {
      return QVariant::fromValue(static_cast<qint32>(*integer));
    }
    return QVariant::fromValue(*integer);
  }
  if (!text.contains(u',')) {
    if (const std::optional<double> decimal = parseDecimalText(text)) return QVariant::fromValue(*decimal);
  }
  return text.toString();
}

FormattedValue formatPropertyValue(const QVariant& value, const PropertyInfo& info) {
  switch (info.type) {
    case PropertyType::String:
      return {quoteVbString(value.toString()), {}};
    case PropertyType::Boolean:
      return formatBoolean(numericValue(value).value_or(0.0) != 0.0);
    case PropertyType::Integer:
    case PropertyType::Long:
      return {QString::number(value.toLongLong()), {}};
    case PropertyType::Single:
      return {formatSingle(value.toFloat()), {}};
    case PropertyType::Double:
      return {formatDouble(value.toDouble()), {}};
    case PropertyType::Color:
      return {formatColor(static_cast<qint32>(value.toLongLong())), {}};
    case PropertyType::Enumerated: {
      const auto number = static_cast<qint32>(value.toLongLong());
      FormattedValue formatted{QString::number(number), {}};
      if (info.writesValueName) {
        const QString name = valueName(info, number);
        if (!name.isEmpty()) formatted.comment = u'\'' + name;
      }
      return formatted;
    }
    case PropertyType::Untyped:
      break;
  }
  return formatUntyped(value);
}

std::optional<QVariant> convertPropertyValue(const QVariant& in, PropertyType type) {
  if (!in.isValid() || in.isNull()) return std::nullopt;
  switch (type) {
    case PropertyType::String:
      if (in.typeId() == QMetaType::Bool)
        return QVariant(in.toBool() ? QStringLiteral("True") : QStringLiteral("False"));
      if (in.typeId() == QMetaType::Float) return QVariant(formatSingle(in.toFloat()));
      if (in.typeId() == QMetaType::Double) return QVariant(formatDouble(in.toDouble()));
      if (isNumberType(in)) return QVariant(QString::number(in.toLongLong()));
      if (in.canConvert<QString>()) return QVariant(in.toString());
      return std::nullopt;
    case PropertyType::Boolean: {
      const std::optional<double> number = numericValue(in);
      if (!number) return std::nullopt;
      return QVariant(*number != 0.0);
    }
    case PropertyType::Integer: {
      const std::optional<QVariant> value =
          toRangedInteger(in, std::numeric_limits<qint16>::min(), std::numeric_limits<qint16>::max());
      if (!value) return std::nullopt;
      return QVariant::fromValue(static_cast<qint16>(value->toLongLong()));
    }
    case PropertyType::Long:
    case PropertyType::Color:
    case PropertyType::Enumerated: {
      const std::optional<QVariant> value =
          toRangedInteger(in, std::numeric_limits<qint32>::min(), std::numeric_limits<qint32>::max());
      if (!value) return std::nullopt;
      return QVariant::fromValue(static_cast<qint32>(value->toLongLong()));
    }
    case PropertyType::Single: {
      const std::optional<double> number = numericValue(in);
      if (!number || std::abs(*number) > std::numeric_limits<float>::max()) return std::nullopt;
      return QVariant::fromValue(static_cast<float>(*number));
    }
    case PropertyType::Double: {
      const std::optional<double> number = numericValue(in);
      if (!number) return std::nullopt;
      return QVariant::fromValue(*number);
    }
    case PropertyType::Untyped:
      return in;
  }
  return std::nullopt;
}

std::optional<QVariant> convertPropertyValue(const QVariant& in, const PropertyInfo& info) {
  std::optional<QVariant> converted = convertPropertyValue(in, info.type);
  if (converted && info.type == PropertyType::Enumerated && !info.valueNames.empty() &&
      valueName(info, converted->value<qint32>()).isEmpty()) {
    return std::nullopt;
  }
  return converted;
}

}  // namespace host
