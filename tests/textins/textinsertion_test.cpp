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
    u"Private Function Print_(ByVal Name As String) As Long|End Function";

struct Editor {
  std::shared_ptr<host::VbeImpl> vbe = host::VbeImpl::create();
  std::shared_ptr<host::ProjectImpl> project = vbe->newProject();
  int lastWindowType = 0;
  InsertionContext context{u"PC-01"_qs, u"ana"_qs, [this] { return lastWindowType; },
                           QLocale(QLocale::Portuguese, QLocale::Brazil),
                           [] { return QDateTime(QDate(2024, 3, 7), QTime(14, 5, 9)); }};

  std::shared_ptr<host::ComponentImpl> open(ide::ComponentType type, const QString& code) {
    auto component = std::dynamic_pointer_cast<host::ComponentImpl>(project->Add(type));
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
  QStringList boxes() {
    QStringList texts;
    for (const auto& box : vbe->headlessUi()->messageBoxes())
      texts << box.prompt;
    return texts;
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
       u"07/03/2024 14:05:09 {Foo} Module1{a{b} {ModuleName    x = 1",
       {}},
      {{2, 1, 2, 1},
       u"{ProcedureName} {ProcedureType} {ModuleName} ",
       2,
       u"{ProcedureName} {ProcedureType} Module1 Private m As Long",
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
      {{4, 5, 4, 5}, u"{SS}{ModuleName}{SE}", 4, u"    Module1x = 1", {4, 5, 4, 5}, 1},
  };
  for (const auto& c : cases) {
    Editor editor;
    editor.lastWindowType = c.lastWindowType;
    auto component = editor.open(ide::ComponentType::StdModule, QString::fromUtf16(kModule));
    editor.vbe->ActiveCodePane()->SetSelection(c.before[0], c.before[1], c.before[2], c.before[3]);
    TextInsertion(*editor.vbe, editor.context).InsertText(QString::fromUtf16(c.text));
    const QStringList expected = QString::fromUtf16(c.lines).split(u'|');
    EXPECT_EQ(component->CodeModule()->Lines(c.from, expected.size()).split(u"\r\n"_qs), expected)
        << QString::fromUtf16(c.text).toStdString();
    if (c.after != Selection{}) {
      EXPECT_EQ(editor.selection(), c.after) << QString::fromUtf16(c.text).toStdString();
    }
    EXPECT_EQ(editor.boxes(), QStringList());
  }
}

TEST(TextInsertion, ControlNameIsTheControlWhoseEventProcedureHoldsTheLine) {
  Editor editor;
  auto form = editor.open(
      ide::ComponentType::VBForm,
      u"Private Sub txtName_Change()|End Sub|Sub cmdOK_Click()|End Sub|"
      u"Private Function txtName_Valid() As Boolean|End Function|Private Sub Form_Load()|End Sub"_qs);
  for (const char* name : {"txtName", "cmdOK"})
    form->Designer()
        ->VBControls()
        ->Add(u"VB.TextBox"_qs)
        ->Properties()
        ->Item(u"Name"_qs)
        ->setValue(QString::fromLatin1(name));
  const TextInsertion insertion(*editor.vbe, editor.context);
  const QString token = u"{ControlName}"_qs;
  EXPECT_EQ(insertion.ExpandPlaceholders(token, form, 2), u"txtName"_qs);
  EXPECT_EQ(insertion.ExpandPlaceholders(token, form, 3), u"cmdOK"_qs);
  EXPECT_EQ(insertion.ExpandPlaceholders(token, form, 6), token);
  EXPECT_EQ(insertion.ExpandPlaceholders(token, form, 8), token);
}

/// An IDE whose selected component cannot reach its project.
class OrphanVbe final : public ide::VBE {
 public:
  explicit OrphanVbe(ide::VBE& ide) : m_ide(ide) {}
  QString Version() override { return m_ide.Version(); }
  ide::Ref<ide::VBProjects> VBProjects() override { return m_ide.VBProjects(); }
  ide::Ref<ide::CommandBars> CommandBars() override { return m_ide.CommandBars(); }
  ide::Ref<ide::Windows> Windows() override { return m_ide.Windows(); }
  ide::Ref<ide::CodePanes> CodePanes() override { return m_ide.CodePanes(); }
  ide::Ref<ide::Events> Events() override { return m_ide.Events(); }
  ide::Ref<ide::AddIns> Addins() override { return m_ide.Addins(); }
  ide::Ref<ide::VBProject> ActiveVBProject() override { return m_ide.ActiveVBProject(); }
  void setActiveVBProject(const ide::Ref<ide::VBProject>& project) override {
    m_ide.setActiveVBProject(project);
  }
  ide::Ref<ide::VBComponent> SelectedVBComponent() override;
  ide::Ref<ide::Window> MainWindow() override { return m_ide.MainWindow(); }
  ide::Ref<ide::Window> ActiveWindow() override { return m_ide.ActiveWindow(); }
  ide::Ref<ide::CodePane> ActiveCodePane() override { return m_ide.ActiveCodePane(); }
  void setActiveCodePane(const ide::Ref<ide::CodePane>& pane) override { m_ide.setActiveCodePane(pane); }
  ide::DisplayModel DisplayModel() override { return m_ide.DisplayModel(); }
  ide::Platform& Platform() override { return m_ide.Platform(); }

 private:
  ide::VBE& m_ide;
};

class OrphanComponent final : public ide::VBComponent {
 public:
  explicit OrphanComponent(ide::Ref<ide::VBComponent> real) : m_real(std::move(real)) {}
  QString Name() override { return m_real->Name(); }
  void setName(const QString& name) override { m_real->setName(name); }
  ide::ComponentType Type() override { return m_real->Type(); }
  ide::Ref<ide::CodeModule> CodeModule() override { return m_real->CodeModule(); }
  ide::Ref<ide::VBForm> Designer() override { return m_real->Designer(); }
  ide::Ref<ide::Properties> Properties() override { return m_real->Properties(); }
  ide::Ref<ide::VBComponents> Collection() override { ide::raise(ide::err::ObjectVariableNotSet); }
  bool Saved() override { return m_real->Saved(); }
  bool IsDirty() override { return m_real->IsDirty(); }
  QString FileNames(int index) override { return m_real->FileNames(index); }
  int FileCount() override { return m_real->FileCount(); }
  void SaveAs(const QString& fileName) override { m_real->SaveAs(fileName); }
  void Activate() override { m_real->Activate(); }
  ide::Ref<ide::Window> DesignerWindow() override { return m_real->DesignerWindow(); }

 private:
  ide::Ref<ide::VBComponent> m_real;
};

ide::Ref<ide::VBComponent> OrphanVbe::SelectedVBComponent() {
  return std::make_shared<OrphanComponent>(m_ide.SelectedVBComponent());
}

TEST(TextInsertion, AFailureLeavesTheCodeAndTheSelectionAsTheyWereAndIsReported) {
  Editor editor;
  auto component = editor.open(ide::ComponentType::StdModule, QString::fromUtf16(kModule));
  const QString before = component->CodeModule()->Lines(1, component->CodeModule()->CountOfLines());
  editor.vbe->ActiveCodePane()->SetSelection(4, 5, 4, 6);
  OrphanVbe orphan(*editor.vbe);
  // The project cannot be reached for {ProjectName}: nothing replaces the selected "x".
  TextInsertion(orphan, editor.context).InsertText(u"' {ProjectName}"_qs);
  // A line the IDE refuses (longer than 1023 characters): the caret does not move to where "{C}" was.
  TextInsertion(*editor.vbe, editor.context).InsertText(QString(1100, u'x') + u"{C}"_qs);
  EXPECT_EQ(component->CodeModule()->Lines(1, component->CodeModule()->CountOfLines()), before);
  EXPECT_EQ(editor.selection(), (Selection{4, 5, 4, 6}));
  EXPECT_EQ(editor.boxes(), QStringList(2, common::LoadResString(5096)));
  EXPECT_EQ(ide::mb::iconOf(editor.vbe->headlessUi()->messageBoxes().front().style), ide::mb::Exclamation);
}

}  // namespace
}  // namespace textins::test
