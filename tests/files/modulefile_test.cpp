// SPDX-License-Identifier: MIT
// Tests of module files: how standard modules, classes and forms split into header, code and hidden member
// attributes; byte-identical writing; renaming; header attributes; and the errors for malformed headers.
#include "host/files/modulefile.h"

#include "testtext.h"

#include <gtest/gtest.h>

namespace host {
namespace {

using testing::asText;
using testing::expectError;
using testing::replacedOnce;
using testing::windowsFile;

constexpr const char* kStandardModule = R"(Attribute VB_Name = "modPrincipal"
Option Explicit

' Ponto de entrada: abre a conexão e mostra a janela principal.
Public gUsuario As String

Public Sub Main()
    gUsuario = Environ$("USERNAME")
    frmPrincipal.Show
End Sub
)";

constexpr const char* kCollectionClass = R"(VERSION 1.0 CLASS
BEGIN
  MultiUse = -1  'True
  Persistable = 0  'NotPersistable
  DataBindingBehavior = 0  'vbNone
  DataSourceBehavior  = 0  'vbNone
  MTSTransactionMode  = 0  'NotAnMTSObject
END
Attribute VB_Name = "clsPedidos"
Attribute VB_GlobalNameSpace = False
Attribute VB_Creatable = True
Attribute VB_PredeclaredId = False
Attribute VB_Exposed = False
Attribute VB_Ext_KEY = "SavedWithClassBuilder6" ,"Yes"
Option Explicit

Private mCol As Collection
Private WithEvents mRelogio As clsRelogio
Attribute mRelogio.VB_VarHelpID = -1

' Item padrão da coleção: Pedidos(1) é o mesmo que Pedidos.Item(1).
Public Property Get Item(ByVal Chave As Variant) As clsPedido
Attribute Item.VB_UserMemId = 0
Attribute Item.VB_Description = "Devolve um pedido pela posição ou pela chave."
    Set Item = mCol(Chave)
End Property

Public Function NewEnum() As IUnknown
Attribute NewEnum.VB_UserMemId = -4
Attribute NewEnum.VB_MemberFlags = "40"
    Set NewEnum = mCol.[_NewEnum]
End Function
)";

constexpr const char* kForm = R"(VERSION 5.00
Object = "{831FDD16-0C5C-11D2-A9FC-0000F8754DA1}#2.0#0"; "MSCOMCTL.OCX"
Object = "{F9043C88-F6F2-101A-A3C9-08002B2F49FB}#1.2#0"; "COMDLG32.OCX"
Begin VB.Form frmSobre 
   BorderStyle     =   3  'Fixed Dialog
   Caption         =   "Sobre a Loja"
   ClientHeight    =   2055
   ClientLeft      =   45
   ClientTop       =   330
   ClientWidth     =   4680
   LinkTopic       =   "Form1"
   ScaleHeight     =   2055
   ScaleWidth      =   4680
   StartUpPosition =   1  'CenterOwner
   Begin VB.Label lblVersao 
      Caption         =   "Versão"
      Height          =   255
      Left            =   120
      TabIndex        =   0
      Top             =   120
      Width           =   4455
   End
End
Attribute VB_Name = "frmSobre"
Attribute VB_GlobalNameSpace = False
Attribute VB_Creatable = False
Attribute VB_PredeclaredId = True
Attribute VB_Exposed = False
Option Explicit

Private Sub Form_Load()
    lblVersao.Caption = "Versão " & App.Major & "." & App.Minor
End Sub
)";

std::vector<QString> texts(const std::vector<SourceLine>& lines) {
  std::vector<QString> result;
  for (const SourceLine& line : lines)
    result.push_back(line.text);
  return result;
}

// --- Splitting -------------------------------------------------------------------------------------------

TEST(ModuleFileTest, StandardModuleHasOnlyItsNameAsHeader) {
  const QByteArray bytes = windowsFile(kStandardModule);
  const ModuleSource module = parseModule(bytes, u"modPrincipal.bas"_qs);
  EXPECT_TRUE(module.preamble.empty());
  EXPECT_FALSE(module.form.has_value());
  ASSERT_EQ(module.moduleAttributes.size(), 1u);
  EXPECT_EQ(module.moduleAttributes[0].text, u"Attribute VB_Name = \"modPrincipal\"");
  ASSERT_EQ(module.code.size(), 9u);
  EXPECT_EQ(module.code[0].text, u"Option Explicit");
  EXPECT_EQ(module.code[2].text,
            QString::fromUtf8("' Ponto de entrada: abre a conexão e mostra a janela principal."));
  EXPECT_EQ(module.code[8].text, u"End Sub");
  EXPECT_TRUE(module.memberAttributes.empty());
  EXPECT_EQ(moduleName(module), u"modPrincipal");
  EXPECT_EQ(asText(writeModule(module, u"modPrincipal.bas"_qs)), asText(bytes));
}

TEST(ModuleFileTest, ClassKeepsItsBeginBlockAndHidesMemberAttributes) {
  const QByteArray bytes = windowsFile(kCollectionClass);
  const ModuleSource module = parseModule(bytes, u"clsPedidos.cls"_qs);
  ASSERT_EQ(module.preamble.size(), 8u);
  EXPECT_EQ(module.preamble.front().text, u"VERSION 1.0 CLASS");
  EXPECT_EQ(module.preamble.back().text, u"END");
  EXPECT_FALSE(module.form.has_value());
  ASSERT_EQ(module.moduleAttributes.size(), 6u);
  EXPECT_EQ(module.moduleAttributes[5].text, u"Attribute VB_Ext_KEY = \"SavedWithClassBuilder6\" ,\"Yes\"");

  // The code lines are what the code window shows: no attribute lines among them.
  ASSERT_EQ(module.code.size(), 13u);
  EXPECT_EQ(module.code[0].text, u"Option Explicit");
  EXPECT_EQ(module.code[6].text, u"Public Property Get Item(ByVal Chave As Variant) As clsPedido");
  EXPECT_EQ(module.code[7].text, u"    Set Item = mCol(Chave)");
  std::vector<std::pair<int, QString>> attributes;
  for (const MemberAttributeLine& attribute : module.memberAttributes)
    attributes.emplace_back(attribute.afterCodeLine, attribute.line.text);
  EXPECT_EQ(attributes, (std::vector<std::pair<int, QString>>{
                            {4, "Attribute mRelogio.VB_VarHelpID = -1"},
                            {7, "Attribute Item.VB_UserMemId = 0"},
                            {7, QString::fromUtf8("Attribute Item.VB_Description = \"Devolve um pedido pela "
                                                  "posição ou pela chave.\"")},
                            {11, "Attribute NewEnum.VB_UserMemId = -4"},
                            {11, "Attribute NewEnum.VB_MemberFlags = \"40\""}}));

  EXPECT_EQ(moduleName(module), u"clsPedidos");
  EXPECT_EQ(asText(writeModule(module, u"clsPedidos.cls"_qs)), asText(bytes));
}

TEST(ModuleFileTest, FormHasObjectLinesAndADescription) {
  const QByteArray bytes = windowsFile(kForm);
  const ModuleSource module = parseModule(bytes, u"frmSobre.frm"_qs);
  EXPECT_EQ(texts(module.preamble),
            (std::vector<QString>{
                "VERSION 5.00", "Object = \"{831FDD16-0C5C-11D2-A9FC-0000F8754DA1}#2.0#0\"; \"MSCOMCTL.OCX\"",
                "Object = \"{F9043C88-F6F2-101A-A3C9-08002B2F49FB}#1.2#0\"; \"COMDLG32.OCX\""}));
  ASSERT_TRUE(module.form.has_value());
  EXPECT_EQ(module.form->root().name(), u"frmSobre");
  ASSERT_EQ(module.form->root().children().size(), 1u);
  EXPECT_EQ(module.form->root().children()[0]->property(u"Caption"), QString::fromUtf8("\"Versão\""));
  EXPECT_EQ(module.moduleAttributes.size(), 5u);
  ASSERT_EQ(module.code.size(), 5u);
  EXPECT_EQ(module.code[0].text, u"Option Explicit");
  EXPECT_EQ(asText(writeModule(module, u"frmSobre.frm"_qs)), asText(bytes));
}

// Each case turns on one rule of where attribute lines belong; every one writes back byte for byte.
TEST(ModuleFileTest, SplitsAttributeLinesByRule) {
  struct Case {
    const char* rule;
    QByteArray bytes;
    const char* name;
    std::vector<int> memberAttributesAfter;  // code lines before each member attribute
    std::size_t codeLines;
  };
  const std::vector<Case> cases = {
      {"Unix line ends and no final line end",
       "Attribute VB_Name = \"m\"\nOption Explicit\nPublic Sub A()\nAttribute A.VB_Description = \"x\"\n"
       "End Sub",
       "m",
       {2},
       3},
      {"mixed line ends in a class header",
       "VERSION 1.0 CLASS\r\nBEGIN\n  MultiUse = -1  'True\rEND\r\nAttribute VB_Name = \"c\"\n",
       "c",
       {},
       0},
      {"a member attribute as the last line, without its end",
       "Attribute VB_Name = \"m\"\r\nAttribute Foo.VB_UserMemId = 0",
       "m",
       {0},
       0},
      {"the word matched case-insensitively and whole",
       windowsFile("attribute vb_name = \"modX\"\nPublic Sub Total()\n  ATTRIBUTE Total.VB_Description = "
                   "\"soma\"\n    Attributes = 1\nEnd Sub\n"),
       "modX",
       {1},
       3},
      {"continued lines are never attributes",
       windowsFile(
           "Attribute VB_Name = \"modApi\"\nPrivate Declare Function GetTickCount Lib \"kernel32\" _\n"
           "    Attribute _\n    () As Long\n' comentário que continua _\nAttribute na linha seguinte\n"),
       "modApi",
       {},
       5},
      {"a module attribute after the first code line is a member attribute",
       windowsFile("Attribute VB_Name = \"m\"\nOption Explicit\nAttribute VB_Creatable = False\n"),
       "m",
       {1},
       1},
      {"member attributes before the first code line stay there",
       windowsFile("Attribute VB_Name = \"m\"\nAttribute Foo.VB_UserMemId = 0\nOption Explicit\n"),
       "m",
       {0},
       1},
  };
  for (const Case& sample : cases) {
    SCOPED_TRACE(sample.rule);
    const ModuleSource module = parseModule(sample.bytes, u"m.bas"_qs);
    EXPECT_EQ(moduleName(module), QString::fromLatin1(sample.name));
    EXPECT_EQ(module.moduleAttributes.size(), 1u);
    std::vector<int> after;
    for (const MemberAttributeLine& attribute : module.memberAttributes)
      after.push_back(attribute.afterCodeLine);
    EXPECT_EQ(after, sample.memberAttributesAfter);
    EXPECT_EQ(module.code.size(), sample.codeLines);
    EXPECT_EQ(asText(writeModule(module, u"m.bas"_qs)), asText(sample.bytes));
  }
}

TEST(ModuleFileTest, EmptyFileHasNoParts) {
  const ModuleSource module = parseModule(QByteArrayView(), u"Module1.bas"_qs);
  EXPECT_TRUE(module.preamble.empty());
  EXPECT_TRUE(module.moduleAttributes.empty());
  EXPECT_TRUE(module.code.empty());
  EXPECT_EQ(moduleName(module), u"");
  EXPECT_TRUE(writeModule(module, u"Module1.bas"_qs).isEmpty());
}

// --- Writing after edits ---------------------------------------------------------------------------------

TEST(ModuleFileTest, MemberAttributesFollowTheirCodeLineAfterEdits) {
  const QByteArray bytes = windowsFile(kCollectionClass);
  ModuleSource module = parseModule(bytes, u"clsPedidos.cls"_qs);
  // Insert a line above Item's header and move its attributes down with it, as an editor does.
  module.code.insert(module.code.begin() + 5, SourceLine{u"' Atenção: base 1"_qs, LineEnd::CRLF});
  for (MemberAttributeLine& attribute : module.memberAttributes) {
    if (attribute.afterCodeLine >= 6) ++attribute.afterCodeLine;
  }
  EXPECT_EQ(
      asText(writeModule(module, u"clsPedidos.cls"_qs)),
      asText(replacedOnce(bytes, "' Item padrão da coleção", "' Atenção: base 1\n' Item padrão da coleção")));
}

TEST(ModuleFileTest, WritesAttributesAddedOutOfOrderAfterTheirLines) {
  ModuleSource module =
      parseModule(windowsFile("Attribute VB_Name = \"m\"\nPublic x\nPublic Sub A()\nEnd Sub\n"), u"m.bas"_qs);
  module.memberAttributes.push_back({2, {u"Attribute A.VB_UserMemId = 0"_qs, LineEnd::CRLF}});
  module.memberAttributes.push_back({1, {u"Attribute x.VB_VarUserMemId = 0"_qs, LineEnd::CRLF}});
  module.memberAttributes.push_back({9, {u"Attribute Z.VB_MemberFlags = \"40\""_qs, LineEnd::CRLF}});
  EXPECT_EQ(asText(writeModule(module, u"m.bas"_qs)),
            asText(windowsFile("Attribute VB_Name = \"m\"\nPublic x\nAttribute x.VB_VarUserMemId = 0\n"
                               "Public Sub A()\nAttribute A.VB_UserMemId = 0\nEnd Sub\n"
                               "Attribute Z.VB_MemberFlags = \"40\"\n")));
}

TEST(ModuleFileTest, ALastLineWithoutEndGetsOneWhenLinesFollowIt) {
  ModuleSource module = parseModule("Attribute VB_Name = \"m\"\r\nOption Explicit", u"m.bas"_qs);
  module.code.push_back({u"Dim x"_qs, LineEnd::None});
  EXPECT_EQ(writeModule(module, u"m.bas"_qs),
            QByteArray("Attribute VB_Name = \"m\"\r\nOption Explicit\r\nDim x"));
}

TEST(ModuleFileTest, WritingNamesTheFileLineOfAnUnwritableCharacter) {
  ModuleSource module = parseModule(windowsFile(kCollectionClass), u"clsPedidos.cls"_qs);
  module.code[7].text = QString::fromUtf16(u"    Set Item = mCol(\"\u4E2D\")");
  const ide::Error error = expectError([&] { writeModule(module, u"clsPedidos.cls"_qs); });
  EXPECT_EQ(error.number(), ide::err::InvalidFileFormat);
  // 8 preamble lines, 6 header attributes, 7 code lines and 3 member attributes come before it.
  EXPECT_TRUE(error.description().startsWith(u"clsPedidos.cls, line 25: the character U+4E2D in column 22"))
      << error.what();
}

// --- Names and header attributes -------------------------------------------------------------------------

TEST(ModuleFileTest, RenamingRewritesTheNameLinesOrAddsOne) {
  const QByteArray form = windowsFile(kForm);
  ModuleSource module = parseModule(form, u"frmSobre.frm"_qs);
  setModuleName(module, u"frmCreditos"_qs);
  EXPECT_EQ(moduleName(module), u"frmCreditos");
  QByteArray expected = replacedOnce(form, "Begin VB.Form frmSobre \n", "Begin VB.Form frmCreditos \n");
  expected =
      replacedOnce(expected, "Attribute VB_Name = \"frmSobre\"\n", "Attribute VB_Name = \"frmCreditos\"\n");
  EXPECT_EQ(asText(writeModule(module, u"frmCreditos.frm"_qs)), asText(expected));

  ModuleSource withoutName = parseModule("Option Explicit\nDim x\n", u"sem nome.bas"_qs);
  EXPECT_EQ(moduleName(withoutName), u"");
  setModuleName(withoutName, u"modNovo"_qs);
  EXPECT_EQ(writeModule(withoutName, u"modNovo.bas"_qs),
            QByteArray("Attribute VB_Name = \"modNovo\"\nOption Explicit\nDim x\n"));

  // A class's name line goes after its BEGIN block, before the other attributes.
  ModuleSource classWithoutName = parseModule(
      windowsFile("VERSION 1.0 CLASS\nBEGIN\n  MultiUse = -1  'True\nEND\nAttribute VB_Exposed = False\n"),
      u"c.cls"_qs);
  setModuleName(classWithoutName, u"a\"b"_qs);
  EXPECT_EQ(moduleName(classWithoutName), u"a\"b");
  EXPECT_EQ(asText(writeModule(classWithoutName, u"c.cls"_qs)),
            asText(windowsFile("VERSION 1.0 CLASS\nBEGIN\n  MultiUse = -1  'True\nEND\n"
                               "Attribute VB_Name = \"a\"\"b\"\nAttribute VB_Exposed = False\n")));
}

TEST(ModuleFileTest, ReadsAndWritesHeaderAttributes) {
  const QByteArray bytes = windowsFile(kForm);
  ModuleSource module = parseModule(bytes, u"frmSobre.frm"_qs);
  EXPECT_EQ(moduleAttribute(module, u"VB_PredeclaredId"), u"True");
  EXPECT_EQ(moduleAttribute(module, u"vb_name"), u"\"frmSobre\"");
  EXPECT_FALSE(moduleAttribute(module, u"VB_Description").has_value());

  setModuleAttribute(module, u"VB_Exposed"_qs, u"False"_qs);  // unchanged
  EXPECT_EQ(asText(writeModule(module, u"frmSobre.frm"_qs)), asText(bytes));

  setModuleAttribute(module, u"VB_PredeclaredId"_qs, u"False"_qs);
  setModuleAttribute(module, u"VB_Description"_qs, u"\"Janela Sobre\""_qs);
  QByteArray expected =
      replacedOnce(bytes, "Attribute VB_PredeclaredId = True\n", "Attribute VB_PredeclaredId = False\n");
  expected = replacedOnce(expected, "Attribute VB_Exposed = False\n",
                          "Attribute VB_Exposed = False\nAttribute VB_Description = \"Janela Sobre\"\n");
  EXPECT_EQ(asText(writeModule(module, u"frmSobre.frm"_qs)), asText(expected));
}

// --- Errors ----------------------------------------------------------------------------------------------

TEST(ModuleFileTest, ErrorsNameTheFileAndTheLine) {
  struct Case {
    const char* fileName;
    QByteArray bytes;
    const char* description;
  };
  const std::vector<Case> cases = {
      {"clsX.cls",
       windowsFile("VERSION 1.0 CLASS\nBEGIN\n  MultiUse = -1  'True\nAttribute VB_Name = \"clsX\"\n"),
       "clsX.cls, line 2: BEGIN without END"},
      // The form description's errors count the lines before it.
      {"frmX.frm",
       windowsFile(
           "VERSION 5.00\nObject = \"{0}#1.0#0\"; \"x.ocx\"\nBegin VB.Form frmX \n   Caption = \"x\"\n"
           "Attribute VB_Name = \"frmX\"\n"),
       "frmX.frm, line 5: unexpected text in the form description: Attribute VB_Name = \"frmX\""},
      {"frmX.frm", windowsFile("VERSION 5.00\nBegin VB.Form frmX \n   ação sem sentido\nEnd\n"),
       "frmX.frm, line 3: unexpected text in the form description: ação sem sentido"},
      {"m.bas", QByteArray("Attribute VB_Name = \"m\"\r\nx\0y\r\n", 30), "m.bas, line 2: not a text file"},
  };
  for (const Case& sample : cases) {
    const ide::Error error =
        expectError([&] { parseModule(sample.bytes, QString::fromLatin1(sample.fileName)); });
    EXPECT_EQ(error.number(), ide::err::InvalidFileFormat);
    EXPECT_EQ(error.description(), QString::fromUtf8(sample.description));
  }
}

}  // namespace
}  // namespace host
