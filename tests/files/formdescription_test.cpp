// SPDX-License-Identifier: MIT
// Tests of form descriptions: the tree read from a realistic form, values as written, edits that change
// only the lines they touch and write new lines in the IDE's layout, moves of control blocks, deep copies,
// and every malformed-input error with its line number.
#include "host/files/formdescription.h"

#include "testtext.h"

#include <gtest/gtest.h>

namespace host {
namespace {

using testing::asText;
using testing::expectError;
using testing::replacedOnce;
using testing::windowsFile;

// A customer form: a Font group, a frame holding a control array, a ListView with column groups, a
// multi-line text kept in the .frx, and a menu. Line 3 is the Begin line.
constexpr const char* kCustomerForm = R"(VERSION 5.00
Object = "{831FDD16-0C5C-11D2-A9FC-0000F8754DA1}#2.0#0"; "MSCOMCTL.OCX"
Begin VB.Form frmCliente 
   BorderStyle     =   3  'Fixed Dialog
   Caption         =   "Cadastro de clientes – edição"
   ClientHeight    =   4530
   ClientLeft      =   45
   ClientTop       =   435
   ClientWidth     =   6855
   BeginProperty Font 
      Name            =   "Tahoma"
      Size            =   8.25
      Charset         =   0
      Weight          =   400
      Underline       =   0   'False
      Italic          =   0   'False
      Strikethrough   =   0   'False
   EndProperty
   Icon            =   "frmCliente.frx":0000
   KeyPreview      =   -1  'True
   LinkTopic       =   "Form1"
   MaxButton       =   0   'False
   MinButton       =   0   'False
   ScaleHeight     =   4530
   ScaleWidth      =   6855
   ShowInTaskbar   =   0   'False
   StartUpPosition =   1  'CenterOwner
   Begin VB.Frame fraEndereco 
      Caption         =   "Endereço"
      Height          =   1575
      Left            =   120
      TabIndex        =   4
      Top             =   1320
      Width           =   6615
      Begin VB.TextBox txtCampo 
         Height          =   315
         Index           =   1
         Left            =   1320
         MaxLength       =   60
         TabIndex        =   6
         Text            =   "Rua ""Principal"""
         Top             =   720
         Width           =   5055
      End
      Begin VB.TextBox txtCampo 
         Height          =   315
         Index           =   0
         Left            =   1320
         TabIndex        =   5
         Top             =   300
         Width           =   5055
      End
      Begin VB.Label lblCidade 
         Alignment       =   1  'Right Justify
         BackStyle       =   0  'Transparent
         Caption         =   "Cidade:"
         Height          =   255
         Left            =   120
         TabIndex        =   7
         Top             =   780
         Width           =   1095
      End
   End
   Begin MSComctlLib.ListView lvwContatos 
      Height          =   1215
      Left            =   120
      TabIndex        =   3
      Tag             =   "Don't sort"
      Top             =   3000
      Width           =   6615
      _ExtentX        =   11668
      _ExtentY        =   2143
      View            =   3
      LabelEdit       =   1
      LabelWrap       =   -1  'True
      HideSelection   =   0   'False
      HideColumnHeaders=   -1  'True
      _Version        =   393217
      ForeColor       =   -2147483640
      BackColor       =   -2147483643
      BorderStyle     =   1
      Appearance      =   1
      NumItems        =   2
      BeginProperty ColumnHeader(1) {BDD1F052-858B-11D1-B16A-00C0F0283628} 
         Text            =   "Nome"
         Object.Width           =   2540
      EndProperty
      BeginProperty ColumnHeader(2) {BDD1F052-858B-11D1-B16A-00C0F0283628} 
         SubItemIndex    =   1
         Text            =   "Telefone"
         Object.Tag             =   "fone"
         Object.Width           =   2540
      EndProperty
   End
   Begin VB.TextBox txtObservacao 
      Height          =   735
      Left            =   120
      MultiLine       =   -1  'True
      ScrollBars      =   2  'Vertical
      TabIndex        =   2
      Text            =   $"frmCliente.frx":0442
      Top             =   480
      Width           =   6615
   End
   Begin VB.CommandButton cmdOk 
      Caption         =   "OK"
      Default         =   -1  'True
      Height          =   375
      Left            =   5520
      TabIndex        =   0
      Top             =   4080
      Width           =   1215
   End
   Begin VB.Menu mnuArquivo 
      Caption         =   "&Arquivo"
      Begin VB.Menu mnuSair 
         Caption         =   "&Sair"
         Shortcut        =   ^Q
      End
   End
End
Attribute VB_Name = "frmCliente"
)";

constexpr std::size_t kBeginIndex = 2;

class FormDescriptionTest : public ::testing::Test {
 protected:
  void SetUp() override { read(); }

  void read() {
    m_bytes = windowsFile(kCustomerForm);
    m_lines = readSourceLines(m_bytes, u"frmCliente.frm"_qs);
    std::size_t position = kBeginIndex;
    m_form.emplace(FormDescription::parse(m_lines, position, u"frmCliente.frm"_qs));
    m_afterEnd = position;
  }

  /// The whole file again, with the (possibly edited) description in place of the original one.
  QByteArray writtenFile() const {
    std::vector<SourceLine> lines(m_lines.begin(), m_lines.begin() + kBeginIndex);
    m_form->appendLines(lines);
    lines.insert(lines.end(), m_lines.begin() + static_cast<std::ptrdiff_t>(m_afterEnd), m_lines.end());
    return writeSourceLines(lines, u"frmCliente.frm"_qs);
  }

  FormNode& node(const char* name, int index = -1) {
    FormNode* found = m_form->root().findNode(QString::fromLatin1(name), index);
    EXPECT_NE(found, nullptr) << name;
    return *found;
  }

  QByteArray m_bytes;
  std::vector<SourceLine> m_lines;
  std::optional<FormDescription> m_form;
  std::size_t m_afterEnd = 0;
};

// --- Reading ---------------------------------------------------------------------------------------------

TEST_F(FormDescriptionTest, WritesBackByteForByte) {
  EXPECT_EQ(m_afterEnd, m_lines.size() - 1) << "parsing stops after the root's End";
  EXPECT_EQ(asText(writtenFile()), asText(m_bytes));
}

TEST_F(FormDescriptionTest, ReadsTheTreeOfControls) {
  const FormNode& root = m_form->root();
  EXPECT_EQ(root.className(), u"VB.Form");
  EXPECT_EQ(root.name(), u"frmCliente");
  EXPECT_EQ(root.parent(), nullptr);
  ASSERT_EQ(root.children().size(), 5u);
  const char* const names[] = {"fraEndereco", "lvwContatos", "txtObservacao", "cmdOk", "mnuArquivo"};
  for (std::size_t i = 0; i < 5; ++i) {
    EXPECT_EQ(root.children()[i]->name(), QString::fromLatin1(names[i]));
    EXPECT_EQ(root.children()[i]->parent(), &root);
  }
  EXPECT_EQ(root.children()[1]->className(), u"MSComctlLib.ListView");

  const FormNode& frame = *root.children()[0];
  ASSERT_EQ(frame.children().size(), 3u);
  EXPECT_EQ(frame.children()[0]->className(), u"VB.TextBox");
  EXPECT_EQ(frame.children()[0]->name(), u"txtCampo");
  EXPECT_EQ(frame.children()[0]->index(), 1);
  EXPECT_EQ(frame.children()[1]->index(), 0);
  EXPECT_EQ(frame.children()[2]->index(), -1);
  EXPECT_EQ(frame.children()[2]->parent(), &frame);

  const FormNode& menu = *root.children()[4];
  ASSERT_EQ(menu.children().size(), 1u);
  EXPECT_EQ(menu.children()[0]->name(), u"mnuSair");
}

TEST_F(FormDescriptionTest, ListsPropertiesInFileOrder) {
  EXPECT_EQ(node("txtCampo", 1).propertyNames(),
            (QStringList{"Height", "Index", "Left", "MaxLength", "TabIndex", "Text", "Top", "Width"}));
  // The Font group is not a property line.
  EXPECT_EQ(m_form->root().propertyNames().size(), 15);
  EXPECT_FALSE(m_form->root().propertyNames().contains(u"Font"_qs));
}

TEST_F(FormDescriptionTest, ReadsValuesAsWrittenWithoutComments) {
  const FormNode& root = m_form->root();
  EXPECT_EQ(root.property(u"Caption"), QString::fromUtf8("\"Cadastro de clientes – edição\""));
  EXPECT_EQ(root.property(u"BorderStyle"), u"3");
  EXPECT_EQ(root.propertyComment(u"BorderStyle"), u"'Fixed Dialog");
  EXPECT_EQ(root.property(u"KeyPreview"), u"-1");
  EXPECT_EQ(root.propertyComment(u"KeyPreview"), u"'True");
  EXPECT_EQ(root.property(u"MaxButton"), u"0");
  EXPECT_EQ(root.property(u"Icon"), u"\"frmCliente.frx\":0000");
  EXPECT_EQ(root.propertyComment(u"Icon"), u"");
  EXPECT_EQ(root.property(u"StartUpPosition"), u"1");
  EXPECT_FALSE(root.property(u"WindowState").has_value());

  EXPECT_EQ(node("txtCampo", 1).property(u"Text"), u"\"Rua \"\"Principal\"\"\"");
  EXPECT_EQ(node("txtObservacao").property(u"Text"), u"$\"frmCliente.frx\":0442");
  EXPECT_EQ(node("mnuSair").property(u"Shortcut"), u"^Q");
  // An apostrophe inside quotes is text, not a comment.
  EXPECT_EQ(node("lvwContatos").property(u"Tag"), u"\"Don't sort\"");
  EXPECT_EQ(node("lvwContatos").propertyComment(u"Tag"), u"");
  EXPECT_EQ(node("lvwContatos").property(u"HideColumnHeaders"), u"-1");
  EXPECT_EQ(node("lvwContatos").property(u"_ExtentX"), u"11668");
  // Names compare without regard to case.
  EXPECT_EQ(root.property(u"caption"), root.property(u"Caption"));
  EXPECT_EQ(node("TXTCAMPO", 0).name(), u"txtCampo");
}

TEST_F(FormDescriptionTest, ReadsPropertyGroups) {
  const std::vector<PropertyBlock*> fonts = m_form->root().propertyBlocks();
  ASSERT_EQ(fonts.size(), 1u);
  EXPECT_EQ(fonts[0]->name(), u"Font");
  EXPECT_EQ(fonts[0]->guid(), u"");
  EXPECT_EQ(fonts[0]->property(u"Name"), u"\"Tahoma\"");
  EXPECT_EQ(fonts[0]->property(u"Size"), u"8.25");
  EXPECT_EQ(fonts[0]->propertyComment(u"Italic"), u"'False");

  const std::vector<PropertyBlock*> columns = node("lvwContatos").propertyBlocks();
  ASSERT_EQ(columns.size(), 2u);
  EXPECT_EQ(columns[1]->name(), u"ColumnHeader(2)");
  EXPECT_EQ(columns[1]->guid(), u"{BDD1F052-858B-11D1-B16A-00C0F0283628}");
  EXPECT_EQ(columns[1]->propertyNames(), (QStringList{"SubItemIndex", "Text", "Object.Tag", "Object.Width"}));
  EXPECT_EQ(columns[1]->property(u"Object.Tag"), u"\"fone\"");
  EXPECT_EQ(node("lvwContatos").propertyBlock(u"columnheader(1)"), columns[0]);
  EXPECT_EQ(node("lvwContatos").propertyBlock(u"Font"), nullptr);
}

QByteArray written(const FormDescription& form, const QString& file) {
  std::vector<SourceLine> lines;
  form.appendLines(lines);
  return writeSourceLines(lines, file);
}

/// A description that is the whole file, read; it writes back byte for byte.
FormDescription readAlone(const QByteArray& bytes, const QString& file) {
  const std::vector<SourceLine> lines = readSourceLines(bytes, file);
  std::size_t position = 0;
  FormDescription form = FormDescription::parse(lines, position, file);
  EXPECT_EQ(position, lines.size());
  EXPECT_EQ(asText(written(form, file)), asText(bytes));
  return form;
}

TEST(FormDescriptionReadTest, NestedPropertyGroupsAndDesignerClasses) {
  const QByteArray bytes = windowsFile(R"(Begin {C0E45035-5775-11D0-B388-00A0C9055D8E} deDados 
   ClientHeight    =   5760
   _ExtentX        =   12700
   FolderFlags     =   1
   NumConnections  =   1
   BeginProperty Connection1 
      ConnectionName  =   "conLoja"
      BeginProperty Attributes {0BE35203-8F91-11CE-9DE3-00AA004BB851} 
         Prompt          =   0
      EndProperty
   EndProperty
End
)");
  const FormDescription form = readAlone(bytes, u"deDados.Dsr"_qs);
  EXPECT_EQ(form.root().className(), u"{C0E45035-5775-11D0-B388-00A0C9055D8E}");
  EXPECT_EQ(form.root().name(), u"deDados");
  PropertyBlock* connection = form.root().propertyBlock(u"Connection1");
  ASSERT_NE(connection, nullptr);
  ASSERT_EQ(connection->propertyBlocks().size(), 1u);
  EXPECT_EQ(connection->propertyBlocks()[0]->property(u"Prompt"), u"0");
}

TEST(FormDescriptionReadTest, KeepsBlankLinesAndUnusualSpacing) {
  const QByteArray bytes(
      "Begin VB.Form Form1\n\tCaption=\"x\"   \n\n   Begin VB.Timer Timer1\n      Interval"
      "   =   500 ' half a second\n   End\nEnd");
  const FormDescription form = readAlone(bytes, u"Form1.frm"_qs);
  EXPECT_EQ(form.root().name(), u"Form1");
  EXPECT_EQ(form.root().property(u"Caption"), u"\"x\"");
  EXPECT_EQ(form.root().children()[0]->property(u"Interval"), u"500");
  EXPECT_EQ(form.root().children()[0]->propertyComment(u"Interval"), u"' half a second");
}

// --- Property edits --------------------------------------------------------------------------------------

// One property set on a freshly read form: only its line changes (or one is inserted), in the IDE's layout.
TEST_F(FormDescriptionTest, SettingAPropertyRewritesOnlyItsLine) {
  struct Case {
    const char* node;  // null: the form
    int index;
    const char* property;
    const char* value;
    const char* comment;
    const char* from;  // null: nothing changes
    const char* to;
  };
  const std::vector<Case> cases = {
      {"txtCampo", 1, "MaxLength", "80", "", "         MaxLength       =   60\n",
       "         MaxLength       =   80\n"},
      {nullptr, -1, "StartUpPosition", "1", "'CenterOwner", nullptr, nullptr},
      {nullptr, -1, "caption", "\"Cadastro de clientes – edição\"", "", nullptr, nullptr},
      // The file's spelling of the name stays.
      {nullptr, -1, "startupposition", "2", "'CenterScreen", "   StartUpPosition =   1  'CenterOwner\n",
       "   StartUpPosition =   2  'CenterScreen\n"},
      // Boolean comments line up one column further than enumerated ones.
      {nullptr, -1, "KeyPreview", "0", "'False", "   KeyPreview      =   -1  'True\n",
       "   KeyPreview      =   0   'False\n"},
      {nullptr, -1, "MaxButton", "-1", "'True", "   MaxButton       =   0   'False\n",
       "   MaxButton       =   -1  'True\n"},
      {nullptr, -1, "BorderStyle", "1", "", "   BorderStyle     =   3  'Fixed Dialog\n",
       "   BorderStyle     =   1\n"},
      {"txtObservacao", -1, "ScrollBars", "3", "Both", "      ScrollBars      =   2  'Vertical\n",
       "      ScrollBars      =   3  'Both\n"},
      {"lvwContatos", -1, "HideColumnHeaders", "0", "'False", "      HideColumnHeaders=   -1  'True\n",
       "      HideColumnHeaders=   0   'False\n"},
      // A new property goes in alphabetical order counting the Font group ("ForeColor" follows it)...
      {nullptr, -1, "ForeColor", "&H00FF0000&", "", "   EndProperty\n   Icon ",
       "   EndProperty\n   ForeColor       =   &H00FF0000&\n   Icon "},
      // ... and one after the last goes before the first control.
      {nullptr, -1, "WindowState", "2", "'Maximized",
       "   StartUpPosition =   1  'CenterOwner\n   Begin VB.Frame",
       "   StartUpPosition =   1  'CenterOwner\n   WindowState     =   2  'Maximized\n   Begin VB.Frame"},
  };
  for (const Case& sample : cases) {
    SCOPED_TRACE(sample.property);
    read();
    FormNode& target = sample.node ? node(sample.node, sample.index) : m_form->root();
    target.setProperty(QString::fromUtf8(sample.property), QString::fromUtf8(sample.value),
                       QString::fromUtf8(sample.comment));
    EXPECT_EQ(asText(writtenFile()),
              asText(sample.from ? replacedOnce(m_bytes, sample.from, sample.to) : m_bytes));
    EXPECT_EQ(target.property(QString::fromUtf8(sample.property)), QString::fromUtf8(sample.value));
  }
  EXPECT_EQ(m_form->root().propertyNames().last(), u"WindowState");
}

TEST_F(FormDescriptionTest, NewPropertiesGoInAlphabeticalOrderInTheIdesLayout) {
  FormNode& text = node("txtCampo", 0);
  text.setProperty(u"Enabled"_qs, u"0"_qs, u"'False"_qs);
  text.setProperty(u"Alignment"_qs, u"2"_qs, u"'Center"_qs);
  text.setProperty(u"Locked"_qs, u"-1"_qs, u"'True"_qs);
  text.setProperty(u"ToolTipText"_qs, u"\"Número\""_qs);
  EXPECT_EQ(asText(writtenFile()), asText(replacedOnce(m_bytes, R"(      Begin VB.TextBox txtCampo 
         Height          =   315
         Index           =   0
         Left            =   1320
         TabIndex        =   5
         Top             =   300
         Width           =   5055
      End
)",
                                                       R"(      Begin VB.TextBox txtCampo 
         Alignment       =   2  'Center
         Enabled         =   0   'False
         Height          =   315
         Index           =   0
         Left            =   1320
         Locked          =   -1  'True
         TabIndex        =   5
         ToolTipText     =   "Número"
         Top             =   300
         Width           =   5055
      End
)")));
}

TEST_F(FormDescriptionTest, ObjectNamesInPropertyGroupsUseTheIdesPadding) {
  node("lvwContatos").propertyBlock(u"ColumnHeader(1)")->setProperty(u"Object.Tag"_qs, u"\"nome\""_qs);
  // The control's own order is not alphabetical; a new line still goes before the first name after it.
  EXPECT_EQ(asText(writtenFile()),
            asText(replacedOnce(
                m_bytes, "         Text            =   \"Nome\"\n",
                "         Object.Tag             =   \"nome\"\n         Text            =   \"Nome\"\n")));
}

TEST_F(FormDescriptionTest, RemovesProperties) {
  EXPECT_TRUE(node("cmdOk").removeProperty(u"default"));
  EXPECT_FALSE(node("cmdOk").removeProperty(u"Default"));
  EXPECT_EQ(asText(writtenFile()),
            asText(replacedOnce(m_bytes, "      Default         =   -1  'True\n", "")));
}

TEST_F(FormDescriptionTest, RefusesValuesThatWouldNotReadBack) {
  FormNode& ok = node("cmdOk");
  // A line break, an unbalanced quote that would swallow the comment, blanks the reader would trim.
  for (const QString& value : {u"\"a\nb\""_qs, u"\"open"_qs, u"x  "_qs}) {
    const ide::Error error = expectError([&] { ok.setProperty(u"Caption"_qs, value, u"'note"_qs); });
    EXPECT_EQ(error.number(), ide::err::InvalidProcedureCall);
  }
  for (const QString& name : {QString(), u"Two Words"_qs, u"A=B"_qs}) {
    const ide::Error error = expectError([&] { ok.setProperty(name, u"1"_qs); });
    EXPECT_EQ(error.number(), ide::err::InvalidProcedureCall);
  }
  EXPECT_EQ(asText(writtenFile()), asText(m_bytes)) << "a refused edit leaves the description alone";
}

TEST_F(FormDescriptionTest, SetsAndRemovesTheIndex) {
  node("lblCidade").setIndex(3);
  node("txtCampo", 1).setIndex(-1);
  node("txtCampo", 0).setIndex(0);  // unchanged
  QByteArray expected =
      replacedOnce(m_bytes, "         Height          =   255\n         Left            =   120\n",
                   "         Height          =   255\n         Index           =   3\n"
                   "         Left            =   120\n");
  expected = replacedOnce(expected, "         Index           =   1\n", "");
  EXPECT_EQ(asText(writtenFile()), asText(expected));
  EXPECT_EQ(node("lblCidade").index(), 3);
}

TEST_F(FormDescriptionTest, AddsAndRemovesPropertyGroups) {
  PropertyBlock& font = node("cmdOk").addPropertyBlock(u"Font"_qs);
  font.setProperty(u"Name"_qs, u"\"Arial\""_qs);
  font.setProperty(u"Size"_qs, u"9.75"_qs);
  EXPECT_EQ(asText(writtenFile()),
            asText(replacedOnce(m_bytes, "      Default         =   -1  'True\n      Height",
                                R"(      Default         =   -1  'True
      BeginProperty Font 
         Name            =   "Arial"
         Size            =   9.75
      EndProperty
      Height)")));
  EXPECT_TRUE(node("cmdOk").removePropertyBlock(u"font"));
  EXPECT_FALSE(node("cmdOk").removePropertyBlock(u"Font"));
  EXPECT_EQ(asText(writtenFile()), asText(m_bytes));

  PropertyBlock& column =
      node("lvwContatos")
          .addPropertyBlock(u"ColumnHeader(3)"_qs, u"{BDD1F052-858B-11D1-B16A-00C0F0283628}"_qs);
  EXPECT_EQ(column.guid(), u"{BDD1F052-858B-11D1-B16A-00C0F0283628}");
  EXPECT_EQ(node("lvwContatos").propertyBlocks().size(), 3u);
}

// --- Control edits ---------------------------------------------------------------------------------------

TEST_F(FormDescriptionTest, RenamingRewritesOnlyTheNameOnTheBeginLine) {
  node("cmdOk").setName(u"cmdConfirmar"_qs);
  EXPECT_EQ(asText(writtenFile()), asText(replacedOnce(m_bytes, "   Begin VB.CommandButton cmdOk \n",
                                                       "   Begin VB.CommandButton cmdConfirmar \n")));
  EXPECT_EQ(m_form->root().children()[3]->name(), u"cmdConfirmar");
  EXPECT_EQ(expectError([&] { node("cmdConfirmar").setName(u"two words"_qs); }).number(),
            ide::err::InvalidProcedureCall);
}

TEST_F(FormDescriptionTest, AddsControlsAsTheIdeWritesThem) {
  FormNode& added = node("fraEndereco").addChild(u"VB.TextBox"_qs, u"txtCep"_qs, 1);
  added.setProperty(u"Height"_qs, u"315"_qs);
  added.setProperty(u"Left"_qs, u"1320"_qs);
  EXPECT_EQ(added.parent(), &node("fraEndereco"));
  EXPECT_EQ(added.className(), u"VB.TextBox");
  EXPECT_EQ(added.index(), -1);
  ASSERT_EQ(node("fraEndereco").children().size(), 4u);
  EXPECT_EQ(node("fraEndereco").children()[1], &added);
  EXPECT_EQ(asText(writtenFile()), asText(replacedOnce(m_bytes, R"(         Width           =   5055
      End
      Begin VB.TextBox txtCampo 
         Height          =   315
         Index           =   0
)",
                                                       R"(         Width           =   5055
      End
      Begin VB.TextBox txtCep 
         Height          =   315
         Left            =   1320
      End
      Begin VB.TextBox txtCampo 
         Height          =   315
         Index           =   0
)")));
}

TEST_F(FormDescriptionTest, AppendsControlsAfterTheLastOne) {
  m_form->root().addChild(u"VB.Timer"_qs, u"tmrRelogio"_qs);
  node("mnuSair").addChild(u"VB.Menu"_qs, u"mnuSub"_qs, 7);
  QByteArray expected =
      replacedOnce(m_bytes, "         Shortcut        =   ^Q\n      End\n   End\nEnd\n",
                   "         Shortcut        =   ^Q\n         Begin VB.Menu mnuSub \n         End\n"
                   "      End\n   End\n   Begin VB.Timer tmrRelogio \n   End\nEnd\n");
  EXPECT_EQ(asText(writtenFile()), asText(expected));
}

TEST_F(FormDescriptionTest, TakesAControlWithItsWholeBlock) {
  FormNode& frame = node("fraEndereco");
  std::unique_ptr<FormNode> label = frame.takeChild(node("lblCidade"));
  ASSERT_NE(label, nullptr);
  EXPECT_EQ(label->parent(), nullptr);
  EXPECT_EQ(frame.children().size(), 2u);
  EXPECT_EQ(frame.takeChild(*label), nullptr) << "no longer a child";
  EXPECT_EQ(frame.takeChild(node("cmdOk")), nullptr) << "not a child of the frame";
  // Its lines, from its Begin line to its End line, go.
  QByteArray expected = m_bytes;
  const QByteArray end = "      End\r\n";
  const qsizetype begin = expected.indexOf("      Begin VB.Label lblCidade");
  expected.remove(begin, expected.indexOf(end, begin) + end.size() - begin);
  EXPECT_EQ(asText(writtenFile()), asText(expected));
}

TEST_F(FormDescriptionTest, MovingAControlReindentsItsLines) {
  std::unique_ptr<FormNode> label = node("fraEndereco").takeChild(node("lblCidade"));
  label->setName(u"lblMovido"_qs);
  FormNode& moved = m_form->root().insertChild(std::move(label), 0);
  EXPECT_EQ(moved.parent(), &m_form->root());
  EXPECT_EQ(m_form->root().children()[0], &moved);
  moved.setProperty(u"Top"_qs, u"60"_qs);
  EXPECT_EQ(moved.name(), u"lblMovido");
  EXPECT_EQ(moved.property(u"Caption"), u"\"Cidade:\"");

  std::vector<SourceLine> lines;
  moved.appendLines(lines);
  ASSERT_EQ(lines.size(), 10u);
  EXPECT_EQ(lines[0].text, u"   Begin VB.Label lblMovido ");
  EXPECT_EQ(lines[1].text, u"      Alignment       =   1  'Right Justify");
  EXPECT_EQ(lines[7].text, u"      Top             =   60");
  EXPECT_EQ(lines[9].text, u"   End");

  // Back into the frame, deeper again.
  std::unique_ptr<FormNode> again = m_form->root().takeChild(moved);
  FormNode& deeper = node("fraEndereco").insertChild(std::move(again));
  lines.clear();
  deeper.appendLines(lines);
  EXPECT_EQ(lines[0].text, u"      Begin VB.Label lblMovido ");
  EXPECT_EQ(lines[4].text, u"         Height          =   255");
  EXPECT_EQ(lines[9].text, u"      End");
}

TEST_F(FormDescriptionTest, CopiesAreDeepAndIndependent) {
  FormDescription copy = *m_form;
  copy.root().findNode(u"cmdOk")->setProperty(u"Caption"_qs, u"\"Sim\""_qs);
  copy.root().findNode(u"fraEndereco")->addChild(u"VB.Label"_qs, u"lblNovo"_qs);
  EXPECT_EQ(asText(writtenFile()), asText(m_bytes)) << "the original is untouched";
  EXPECT_EQ(copy.root().children()[0]->children().size(), 4u);
  EXPECT_EQ(copy.root().children()[0]->children()[3]->parent(), copy.root().children()[0]);
  EXPECT_EQ(copy.root().children()[0]->children()[0]->parent(), copy.root().children()[0]);

  FormDescription assigned(u"VB.Form"_qs, u"Other"_qs);
  assigned = copy;
  EXPECT_EQ(assigned.root().findNode(u"cmdOk")->property(u"Caption"), u"\"Sim\"");
  FormDescription moved = std::move(assigned);
  EXPECT_EQ(moved.root().name(), u"frmCliente");
}

TEST(FormDescriptionCreateTest, NewDescriptionsAreWrittenAsTheIdeWritesThem) {
  FormDescription form(u"VB.UserControl"_qs, u"ctlData"_qs, LineEnd::LF);
  form.root().setProperty(u"ScaleHeight"_qs, u"3600"_qs);
  form.root().setProperty(u"ClientHeight"_qs, u"3600"_qs);
  FormNode& box = form.root().addChild(u"VB.TextBox"_qs, u"txtData"_qs);
  box.setProperty(u"Text"_qs, u"\"\""_qs);
  EXPECT_EQ(written(form, u"ctlData.ctl"_qs), QByteArray("Begin VB.UserControl ctlData \n"
                                                         "   ClientHeight    =   3600\n"
                                                         "   ScaleHeight     =   3600\n"
                                                         "   Begin VB.TextBox txtData \n"
                                                         "      Text            =   \"\"\n"
                                                         "   End\n"
                                                         "End\n"));
}

TEST(FormDescriptionCreateTest, GeneratedLinesEndLikeTheirBlocksBeginLine) {
  const QByteArray bytes("Begin VB.Form Form1 \n   Begin VB.Frame Frame1 \r\n   End\nEnd\n");
  FormDescription form = readAlone(bytes, u"Form1.frm"_qs);
  form.root().setProperty(u"Caption"_qs, u"\"x\""_qs);
  form.root().children()[0]->setProperty(u"Caption"_qs, u"\"y\""_qs);
  EXPECT_EQ(written(form, u"Form1.frm"_qs),
            QByteArray("Begin VB.Form Form1 \n   Caption         =   \"x\"\n   Begin VB.Frame Frame1 \r\n"
                       "      Caption         =   \"y\"\r\n   End\nEnd\n"));
}

TEST(FormDescriptionLayoutTest, ComposesPropertyLines) {
  const std::tuple<const char16_t*, const char16_t*, const char16_t*, const char16_t*, const char16_t*>
      rows[] = {
          {u"   ", u"Caption", u"\"Form1\"", u"", u"   Caption         =   \"Form1\""},
          {u"      ", u"Visible", u"0", u"'False", u"      Visible         =   0   'False"},
          {u"", u"AutoSize", u"-1", u"'True", u"AutoSize        =   -1  'True"},
          {u"   ", u"MousePointer", u"11", u"'Hourglass", u"   MousePointer    =   11  'Hourglass"},
          {u"   ", u"Style", u"0", u"'Standard", u"   Style           =   0  'Standard"},
          {u"   ", u"NegotiatePosition", u"3", u"'Right", u"   NegotiatePosition=   3  'Right"},
          {u"   ", u"StartUpPosition", u"3", u"'Windows Default",
           u"   StartUpPosition =   3  'Windows Default"},
          {u"", u"Object.ToolTipText", u"\"\"", u"", u"Object.ToolTipText     =   \"\""},
      };
  for (const auto& [indent, name, value, comment, line] : rows)
    EXPECT_EQ(composePropertyLine(indent, name, value, comment), QStringView(line));
}

// --- Errors ----------------------------------------------------------------------------------------------

struct MalformedForm {
  const char* text;
  const char* description;
};

class FormDescriptionErrorTest : public ::testing::TestWithParam<MalformedForm> {};

TEST_P(FormDescriptionErrorTest, NamesTheFileAndTheLine) {
  const QByteArray bytes = windowsFile(GetParam().text);
  const std::vector<SourceLine> lines = readSourceLines(bytes, u"Form1.frm"_qs);
  std::size_t position = 1;  // after the VERSION line
  const ide::Error error = expectError([&] { FormDescription::parse(lines, position, u"Form1.frm"_qs); });
  EXPECT_EQ(error.number(), ide::err::InvalidFileFormat);
  EXPECT_EQ(error.description(), QString::fromUtf8(GetParam().description));
}

INSTANTIATE_TEST_SUITE_P(
    Malformed, FormDescriptionErrorTest,
    ::testing::Values(
        MalformedForm{"VERSION 5.00\nBegin VB.Form Form1 \n   Caption = \"x\"\n",
                      "Form1.frm, line 2: Begin VB.Form Form1 has no matching End"},
        MalformedForm{
            "VERSION 5.00\nBegin VB.Form Form1 \n   Begin VB.Frame Frame1 \n   End\n   Begin VB.Label L \n"
            "End\n",
            "Form1.frm, line 2: Begin VB.Form Form1 has no matching End"},
        MalformedForm{"VERSION 5.00\nBegin VB.Form Form1 \n   BeginProperty Font \n      Size = 8\nEnd\n",
                      "Form1.frm, line 5: End where EndProperty was expected"},
        MalformedForm{"VERSION 5.00\nBegin VB.Form Form1 \n   BeginProperty Font \n      Size = 8\n",
                      "Form1.frm, line 3: BeginProperty Font has no matching EndProperty"},
        MalformedForm{"VERSION 5.00\nBegin VB.Form Form1 \n   EndProperty\nEnd\n",
                      "Form1.frm, line 3: EndProperty without BeginProperty"},
        MalformedForm{"VERSION 5.00\nBegin VB.Form Form1 \n   Caption = \"ação\"\n   garbage here\nEnd\n",
                      "Form1.frm, line 4: unexpected text in the form description: garbage here"},
        MalformedForm{"VERSION 5.00\nBegin VB.Form Form1 \n   Private Sub Form_Load()\nEnd\n",
                      "Form1.frm, line 3: unexpected text in the form description: Private Sub Form_Load()"},
        MalformedForm{"VERSION 5.00\nBegin VB.Form Form1 \n   = 5\nEnd\n",
                      "Form1.frm, line 3: unexpected text in the form description: = 5"},
        MalformedForm{"VERSION 5.00\nBegin VB.Form\nEnd\n",
                      "Form1.frm, line 2: Begin without a class and a name"},
        MalformedForm{"VERSION 5.00\nBegin VB.Form Form1 \n   BeginProperty \n   EndProperty\nEnd\n",
                      "Form1.frm, line 3: BeginProperty without a name"},
        MalformedForm{"VERSION 5.00\nBegin VB.Form Form1 \n   BeginProperty Font \n      Begin VB.Label L \n"
                      "      End\n   EndProperty\nEnd\n",
                      "Form1.frm, line 4: Begin inside a BeginProperty group"},
        MalformedForm{"VERSION 5.00\nAttribute VB_Name = \"Form1\"\n",
                      "Form1.frm, line 2: a form description must start with Begin"},
        MalformedForm{"VERSION 5.00\n", "Form1.frm, line 2: a form description must start with Begin"}));

TEST(FormDescriptionNestingTest, RefusesAbsurdNestingInsteadOfOverflowing) {
  std::vector<SourceLine> lines;
  for (int i = 0; i < 500; ++i)
    lines.push_back({u"Begin VB.Frame F%1"_qs.arg(i), LineEnd::CRLF});
  for (int i = 0; i < 500; ++i)
    lines.push_back({u"End"_qs, LineEnd::CRLF});
  std::size_t position = 0;
  const ide::Error error = expectError([&] { FormDescription::parse(lines, position, u"deep.frm"_qs); });
  EXPECT_EQ(error.number(), ide::err::InvalidFileFormat);
  EXPECT_EQ(error.description(), u"deep.frm, line 202: controls nested too deeply");
}

}  // namespace
}  // namespace host
