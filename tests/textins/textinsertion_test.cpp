// SPDX-License-Identifier: MIT
// Text insertion in the IDE model: placeholders, cursor markers, the ways a selection is replaced, and
// failures that must leave the code and the selection as they were.
#include "textins/textinsertion.h"

#include "common/strings.h"
#include "host/model/objects.h"
#include "host/model/vbe.h"
#include "host/platform/headlessui.h"
#include "printers.h"

#include <gtest/gtest.h>

#include <array>

namespace textins::test {
namespace {

using Selection = std::array<int, 4>;

constexpr char16_t kModule[] =
    u"Option Explicit|Private m As Long|Sub Main()|    x = 1||10  GoTo 20|20  m = 2|End Sub|"
    u"Public Property Get Text() As String|    Text = \"çé\"|End Property|"
    u"Private Function Print_(ByVal Name As String) As Long|End Function|"
    u"Private Sub txtName_Change()|End Sub|Sub cmdOK_Click()|End Sub|Private Sub Form_Load()|End Sub";

struct Editor {
  std::shared_ptr<host::VbeImpl> vbe = host::VbeImpl::create();
  std::shared_ptr<host::ProjectImpl> project = vbe->newProject();
  int lastWindowType = 0;
  InsertionContext context{u"PC-01"_qs, u"ana"_qs, [this] { return lastWindowType; },
                           QLocale(QLocale::Portuguese, QLocale::Brazil),
                           [] { return QDateTime(QDate(2024, 3, 7), QTime(14, 5, 9)); }};

  /// A form with the controls txtName and cmdOK, holding `code`.
  std::shared_ptr<host::ComponentImpl> open(const QString& code) {
    auto component = std::dynamic_pointer_cast<host::ComponentImpl>(project->Add(ide::ComponentType::VBForm));
    for (const char* name : {"txtName", "cmdOK"})
      component->Designer()
          ->VBControls()
          ->Add(u"VB.TextBox"_qs)
          ->Properties()
          ->Item(u"Name"_qs)
          ->setValue(QString::fromLatin1(name));
    component->CodeModule()->AddFromString(QString(code).replace(u'|', u"\r\n"_qs));
    component->CodeModule()->CodePane()->Show();
    vbe->selectComponent(component);
    return component;
  }
  Selection selection() {
    Selection s{};
    vbe->ActiveCodePane()->GetSelection(s[0], s[1], s[2], s[3]);
    return s;
  }
};

TEST(TextInsertion, PlaceholdersAndMarkersLandWhereTheTextSays) {
  const struct {
    Selection before;
    const char16_t* text;
    int from;
    const char16_t* lines;  // from line `from` on, joined by "|"
    Selection after;        // zero: left to the IDE
    int lastWindowType = 0;
  } cases[] = {
      {{4, 5, 4, 5}, u"Hello {UserName}", 4, u"    Hello anax = 1", {}},
      {{5, 1, 5, 1}, u"If {C} Then", 5, u"If  Then||10  GoTo 20", {5, 4, 5, 4}},
      {{4, 5, 4, 6}, u"{SS}abc{SE}def", 4, u"    abcdef = 1", {4, 5, 4, 8}},
      {{4, 10, 4, 10}, u"{SE}x{ss}abc", 4, u"    x = 1xabc", {4, 11, 4, 14}},
      {{4, 5, 4, 5}, u"abc{SE}def", 4, u"    abcdefx = 1", {4, 5, 4, 8}},
      {{4, 5, 4, 5}, u"{SS}a{C}b{SE}", 4, u"    abx = 1", {4, 6, 4, 6}},
      {{4, 5, 4, 5}, u"{SS}{SE}", 4, u"    x = 1", {4, 5, 4, 5}},
      {{5, 1, 5, 1}, u"Sub X()\r\n    {C}\r\nEnd Sub", 5, u"Sub X()|    |End Sub||10  GoTo 20", {6, 5, 6, 5}},
      {{4, 1, 4, 1}, u"a\r\n\r\n{C}b", 4, u"a||b    x = 1", {6, 1, 6, 1}},
      {{4, 1, 4, 1}, u"x = 1\n{C}", 4, u"x = 1|    x = 1", {5, 1, 5, 1}},
      {{4, 1, 5, 1}, u"' gone", 4, u"' gone||10  GoTo 20", {}},
      {{6, 5, 7, 5}, u"Resume", 6, u"10  Resumem = 2|End Sub", {}},
      {{4, 5, 4, 6}, u"", 4, u"     = 1", {}},
      {{5, 1, 5, 1}, u"", 4, u"    x = 1||10  GoTo 20", {}},
      {{4, 1, 4, 1},
       u"{date} {Time} {Foo} {ModuleName}{a{b} {ModuleName",
       4,
       u"07/03/2024 14:05:09 {Foo} Form1{a{b} {ModuleName    x = 1",
       {}},
      {{2, 1, 2, 1},
       u"{ProcedureName} {ProcedureType} {ModuleName} ",
       2,
       u"{ProcedureName} {ProcedureType} Form1 Private m As Long",
       {}},
      {{4, 1, 4, 1},
       u"{PROCEDURETYPE} {ProcedureName}{ControlName}",
       4,
       u"Sub Main{ControlName}    x = 1",
       {}},
      {{10, 1, 10, 1}, u"{ProcedureType} {ProcedureName} ", 10, u"Property Text     Text = \"çé\"", {}},
      {{13, 1, 13, 1},
       u"{ProcedureType}:{ProjectName}:{ComputerName} ",
       13,
       u"Function:Project1:PC-01 End Function",
       {}},
      {{4, 5, 4, 5}, u"{SS}{ModuleName}{SE}", 4, u"    Form1x = 1", {4, 5, 4, 5}, 1},
      {{15, 1, 15, 1}, u"{ControlName}.", 15, u"txtName.End Sub", {}},
      {{16, 1, 16, 1}, u"{controlname}.", 16, u"cmdOK.Sub cmdOK_Click()", {}},
      {{19, 1, 19, 1}, u"{ControlName}.", 19, u"{ControlName}.End Sub", {}},
  };
  for (const auto& c : cases) {
    Editor editor;
    editor.lastWindowType = c.lastWindowType;
    auto component = editor.open(QString::fromUtf16(kModule));
    editor.vbe->ActiveCodePane()->SetSelection(c.before[0], c.before[1], c.before[2], c.before[3]);
    TextInsertion(*editor.vbe, editor.context).InsertText(QString::fromUtf16(c.text));
    const QStringList expected = QString::fromUtf16(c.lines).split(u'|');
    EXPECT_EQ(component->CodeModule()->Lines(c.from, expected.size()).split(u"\r\n"_qs), expected)
        << QString::fromUtf16(c.text).toStdString();
    if (c.after != Selection{}) {
      EXPECT_EQ(editor.selection(), c.after) << QString::fromUtf16(c.text).toStdString();
    }
    EXPECT_TRUE(editor.vbe->headlessUi()->messageBoxes().empty());
  }
}

TEST(TextInsertion, AFailureLeavesTheCodeAndTheSelectionAsTheyWereAndIsReported) {
  const struct {
    Selection selection;
    QString text;
    const char16_t* told;
  } cases[] = {
      // A line the IDE refuses (longer than 1023 characters): the caret does not go where "{C}" was.
      {{4, 5, 4, 6}, QString(1100, u'x') + u"{C}"_qs, u""},
      // Over three lines, the joined line is refused before any of them goes.
      {{3, 5, 6, 3}, QString(1100, u'x'), u""},
      // A character without a byte in the code page would make the module impossible to save.
      {{4, 5, 4, 5}, u"' 中文"_qs, u"\u201C中\u201D (U+4E2D)"},
  };
  for (const auto& c : cases) {
    Editor editor;
    auto component = editor.open(QString::fromUtf16(kModule));
    const QString before = component->CodeModule()->Lines(1, component->CodeModule()->CountOfLines());
    editor.vbe->ActiveCodePane()->SetSelection(c.selection[0], c.selection[1], c.selection[2],
                                               c.selection[3]);
    TextInsertion insertion(*editor.vbe, editor.context);
    insertion.InsertText(c.text);
    EXPECT_EQ(component->CodeModule()->Lines(1, component->CodeModule()->CountOfLines()), before);
    EXPECT_EQ(editor.selection(), c.selection);
    const auto& boxes = editor.vbe->headlessUi()->messageBoxes();
    ASSERT_EQ(boxes.size(), 1u);
    EXPECT_TRUE(boxes.front().prompt.startsWith(common::LoadResString(5096)));
    EXPECT_TRUE(boxes.front().prompt.contains(QString::fromUtf16(c.told)))
        << boxes.front().prompt.toStdString();
    EXPECT_EQ(ide::mb::iconOf(boxes.front().style), ide::mb::Exclamation);
    // {ProjectName} out of reach fails the expansion, rather than giving an empty text that would replace
    // the selection.
    EXPECT_THROW(insertion.ExpandPlaceholders(u"' {ProjectName}"_qs, nullptr, 1), ide::Error);
  }
}

}  // namespace
}  // namespace textins::test
