// SPDX-License-Identifier: MIT
// Tests of project files: byte-identical writing, keys and values, the component entries and references with
// their edits, [Section] parts, malformed lines, and the conversion of written paths to local paths.
#include "host/files/projectfile.h"

#include "testtext.h"

#include <gtest/gtest.h>

#include <QDir>
#include <QFile>
#include <QTemporaryDir>

namespace host {
namespace {

using testing::asText;
using testing::expectError;
using testing::replacedOnce;
using testing::windowsFile;

constexpr const char* kProject = R"(Type=Exe
Reference=*\G{00020430-0000-0000-C000-000000000046}#2.0#0#..\..\..\Windows\SysWOW64\stdole2.tlb#OLE Automation
Reference=*\A..\Utilitarios\Utilitarios.vbp
Object={831FDD16-0C5C-11D2-A9FC-0000F8754DA1}#2.0#0; MSCOMCTL.OCX
Module=modPrincipal; modPrincipal.bas
Class=clsCliente; Classes\clsCliente.cls
Form=frmPrincipal.frm
Form=Formul\ários\frmCliente.frm
UserControl=ctlData.ctl
RelatedDoc=..\Documentos\Leia-me.txt
ResFile32="Loja.RES"
IconForm="frmPrincipal"
Startup="Sub Main"
HelpFile=""
Title="Loja"
ExeName32="Loja.exe"
Name="Loja"
HelpContextID="0"
Description="Loja – cadastro de clientes e pedidos"
MajorVer=1
MinorVer=4
VersionCompanyName="Comércio Exemplo Ltda."
FavorPentiumPro(tm)=0
CompilationType=0

[MS Transaction Server]
AutoRefresh=1

[Quimbel]
UltimaPesquisa=cliente
)";

class ProjectFileTest : public ::testing::Test {
 protected:
  void SetUp() override {
    m_bytes = windowsFile(kProject);
    m_project = ProjectFile::parse(m_bytes, u"Loja.vbp"_qs);
  }
  QByteArray written() const { return m_project.toBytes(u"Loja.vbp"_qs); }

  QByteArray m_bytes;
  ProjectFile m_project = ProjectFile::parse(QByteArrayView(), u"empty.vbp"_qs);
};

TEST_F(ProjectFileTest, WritesBackByteForByte) {
  EXPECT_EQ(asText(written()), asText(m_bytes));
  EXPECT_EQ(m_project.write().size(), 30u);
}

TEST_F(ProjectFileTest, ReadsRawValues) {
  EXPECT_EQ(m_project.value(u"Type"), u"Exe");
  EXPECT_EQ(m_project.value(u"startup"), u"\"Sub Main\"");
  EXPECT_EQ(m_project.value(u"FavorPentiumPro(tm)"), u"0");
  EXPECT_EQ(m_project.value(u"VersionCompanyName"), QString::fromUtf8("\"Comércio Exemplo Ltda.\""));
  EXPECT_EQ(m_project.value(u"Reference"),
            u"*\\G{00020430-0000-0000-C000-000000000046}#2.0#0#..\\..\\..\\Windows\\"
            u"SysWOW64\\stdole2.tlb#OLE Automation");
  EXPECT_FALSE(m_project.value(u"AutoRefresh").has_value()) << "a section's keys are not the main part's";
  EXPECT_FALSE(m_project.value(u"Missing").has_value());
  EXPECT_EQ(m_project.values(u"Form"),
            (QStringList{"frmPrincipal.frm", QString::fromUtf8("Formul\\ários\\frmCliente.frm")}));
  EXPECT_EQ(m_project.name(), u"Loja");
}

TEST_F(ProjectFileTest, ListsComponentsInFileOrder) {
  const std::vector<ProjectComponent> expected = {
      {ComponentKind::Module, "modPrincipal", "modPrincipal.bas"},
      {ComponentKind::Class, "clsCliente", "Classes\\clsCliente.cls"},
      {ComponentKind::Form, "", "frmPrincipal.frm"},
      {ComponentKind::Form, "", QString::fromUtf8("Formul\\ários\\frmCliente.frm")},
      {ComponentKind::UserControl, "", "ctlData.ctl"},
      {ComponentKind::RelatedDocument, "", "..\\Documentos\\Leia-me.txt"},
      {ComponentKind::ResourceFile, "", "Loja.RES"},
  };
  EXPECT_EQ(m_project.components(), expected);
}

TEST_F(ProjectFileTest, EditsOfTheMainPartRewriteOnlyTheirLines) {
  m_project.setValue(u"MinorVer"_qs, u"5"_qs);
  m_project.setValue(u"Type"_qs, u"Exe"_qs);  // unchanged
  m_project.setValue(u"NoAliasing"_qs, u"0"_qs);
  EXPECT_TRUE(m_project.removeValue(u"helpfile"));
  EXPECT_FALSE(m_project.removeValue(u"HelpFile"));
  m_project.setName(u"LojaNova"_qs);
  QByteArray expected = replacedOnce(m_bytes, "MinorVer=4\n", "MinorVer=5\n");
  expected = replacedOnce(expected, "CompilationType=0\n", "CompilationType=0\nNoAliasing=0\n");
  expected = replacedOnce(expected, "HelpFile=\"\"\n", "");
  expected = replacedOnce(expected, "Name=\"Loja\"\n", "Name=\"LojaNova\"\n");
  EXPECT_EQ(asText(written()), asText(expected));
  EXPECT_EQ(m_project.value(u"NoAliasing"), u"0");
  EXPECT_EQ(m_project.name(), u"LojaNova");
}

TEST_F(ProjectFileTest, AddsComponentsAfterTheLastEntry) {
  m_project.addComponent({ComponentKind::Class, u"clsPedido"_qs, u"clsPedido.cls"_qs});
  m_project.addComponent({ComponentKind::PropertyPage, {}, u"ppgData.pag"_qs});
  m_project.addComponent({ComponentKind::UserDocument, {}, u"docLoja.dob"_qs});
  m_project.addComponent({ComponentKind::Designer, {}, u"deDados.Dsr"_qs});
  m_project.addComponent({ComponentKind::RelatedDocument, {}, u"Notas.txt"_qs});
  EXPECT_EQ(asText(written()), asText(replacedOnce(m_bytes, "ResFile32=\"Loja.RES\"\n",
                                                   "ResFile32=\"Loja.RES\"\nClass=clsPedido; clsPedido.cls\n"
                                                   "PropertyPage=ppgData.pag\nUserDocument=docLoja.dob\n"
                                                   "Designer=deDados.Dsr\nRelatedDoc=Notas.txt\n")));
  EXPECT_EQ(m_project.components().size(), 12u);
  EXPECT_EQ(m_project.components()[8].kind, ComponentKind::PropertyPage);
}

TEST(ProjectFileEditTest, FirstComponentGoesAfterReferencesOrType) {
  ProjectFile withReference = ProjectFile::parse(
      QByteArray("Type=OleDll\r\nReference=*\\Astdole.tlb\r\nObject={0}#1.0#0; x.ocx\r\nName=\"Dll\"\r\n"),
      u"Dll.vbp"_qs);
  withReference.addComponent({ComponentKind::Module, u"modA"_qs, u"modA.bas"_qs});
  EXPECT_EQ(
      withReference.toBytes(u"Dll.vbp"_qs),
      QByteArray(
          "Type=OleDll\r\nReference=*\\Astdole.tlb\r\nObject={0}#1.0#0; x.ocx\r\nModule=modA; modA.bas\r\n"
          "Name=\"Dll\"\r\n"));

  ProjectFile typeOnly = ProjectFile::parse(QByteArray("Type=Exe\nName=\"P\"\n"), u"P.vbp"_qs);
  typeOnly.addComponent({ComponentKind::ResourceFile, {}, u"P.RES"_qs});
  EXPECT_EQ(typeOnly.toBytes(u"P.vbp"_qs), QByteArray("Type=Exe\nResFile32=\"P.RES\"\nName=\"P\"\n"));

  ProjectFile bare = ProjectFile::parse(QByteArray("Name=\"P\""), u"P.vbp"_qs);
  bare.addComponent({ComponentKind::Form, {}, u"Form1.frm"_qs});
  EXPECT_EQ(bare.toBytes(u"P.vbp"_qs), QByteArray("Name=\"P\"\r\nForm=Form1.frm"))
      << "the old last line gets a line end, the new one has none like it had";
}

TEST_F(ProjectFileTest, RemovesComponentsByPosition) {
  m_project.removeComponent(3);
  EXPECT_EQ(asText(written()), asText(replacedOnce(m_bytes, "Form=Formul\\ários\\frmCliente.frm\n", "")));
  EXPECT_EQ(m_project.components().size(), 6u);
  for (const int index : {-1, 6, 100}) {
    EXPECT_EQ(expectError([&] { m_project.removeComponent(index); }).number(), ide::err::SubscriptOutOfRange);
  }
}

TEST_F(ProjectFileTest, RenamesAndMovesComponents) {
  m_project.setComponentName(1, u"clsFreguês"_qs);
  m_project.setComponentPath(1, u"Classes\\clsFregues.cls"_qs);
  m_project.setComponentPath(2, u"Telas\\frmPrincipal.frm"_qs);
  m_project.setComponentPath(6, u"Recursos\\Loja.res"_qs);
  m_project.setComponentName(2, u"ignored"_qs);  // forms are named in their own file
  QByteArray expected = replacedOnce(m_bytes, "Class=clsCliente; Classes\\clsCliente.cls\n",
                                     "Class=clsFreguês; Classes\\clsFregues.cls\n");
  expected = replacedOnce(expected, "Form=frmPrincipal.frm\n", "Form=Telas\\frmPrincipal.frm\n");
  expected = replacedOnce(expected, "ResFile32=\"Loja.RES\"\n", "ResFile32=\"Recursos\\Loja.res\"\n");
  EXPECT_EQ(asText(written()), asText(expected));
  EXPECT_EQ(m_project.components()[1].name, QString::fromUtf8("clsFreguês"));
  EXPECT_EQ(expectError([&] { m_project.setComponentPath(7, u"x"_qs); }).number(),
            ide::err::SubscriptOutOfRange);
}

TEST_F(ProjectFileTest, EditsReferences) {
  ASSERT_EQ(m_project.references().size(), 2);
  EXPECT_EQ(m_project.references()[1], u"*\\A..\\Utilitarios\\Utilitarios.vbp");
  m_project.addReference(QStringLiteral(
      "*\\G{00000205-0000-0010-8000-00AA006D2EA4}#2.5#0#C:\\Arquivos\\msado25.tlb#Microsoft ADO 2.5"));
  m_project.removeReference(0);
  QByteArray expected =
      replacedOnce(m_bytes,
                   "Reference=*\\G{00020430-0000-0000-C000-000000000046}#2.0#0#..\\..\\..\\Windows\\"
                   "SysWOW64\\stdole2.tlb#OLE Automation\n",
                   "");
  expected =
      replacedOnce(expected, "Reference=*\\A..\\Utilitarios\\Utilitarios.vbp\n",
                   "Reference=*\\A..\\Utilitarios\\Utilitarios.vbp\nReference=*\\G{00000205-0000-0010-8000-"
                   "00AA006D2EA4}#2.5#0#C:\\Arquivos\\msado25.tlb#Microsoft ADO 2.5\n");
  EXPECT_EQ(asText(written()), asText(expected));
  EXPECT_EQ(expectError([&] { m_project.removeReference(2); }).number(), ide::err::SubscriptOutOfRange);
}

TEST_F(ProjectFileTest, ReadsAndWritesSections) {
  EXPECT_EQ(m_project.sections(), (QStringList{"MS Transaction Server", "Quimbel"}));
  EXPECT_EQ(m_project.sectionValue(u"ms transaction server", u"AutoRefresh"), u"1");
  EXPECT_EQ(m_project.sectionValue(u"Quimbel", u"UltimaPesquisa"), u"cliente");
  EXPECT_FALSE(m_project.sectionValue(u"Quimbel", u"AutoRefresh").has_value());
  EXPECT_FALSE(m_project.sectionValue(u"Nenhuma", u"x").has_value());

  m_project.setSectionValue(u"MS Transaction Server"_qs, u"AutoRefresh"_qs, u"0"_qs);
  m_project.setSectionValue(u"MS Transaction Server"_qs, u"Extra"_qs, u"sim"_qs);
  m_project.setSectionValue(u"Nova Seção"_qs, u"Chave"_qs, u"valor"_qs);
  QByteArray expected = replacedOnce(m_bytes, "AutoRefresh=1\n", "AutoRefresh=0\nExtra=sim\n");
  expected.append(windowsFile("[Nova Seção]\nChave=valor\n"));
  EXPECT_EQ(asText(written()), asText(expected));
}

TEST(ProjectFileEditTest, NewSectionAfterALastLineWithoutEnd) {
  ProjectFile project = ProjectFile::parse(QByteArray("Type=Exe\r\nName=\"P\""), u"P.vbp"_qs);
  project.setSectionValue(u"Add-In"_qs, u"Mode"_qs, u"1"_qs);
  EXPECT_EQ(project.toBytes(u"P.vbp"_qs), QByteArray("Type=Exe\r\nName=\"P\"\r\n[Add-In]\r\nMode=1"));
}

TEST(ProjectFileErrorTest, MalformedMainPartLinesNameTheFileAndLine) {
  const QByteArray bytes = windowsFile("Type=Exe\nModule=modA; modA.bas\nisto não é uma chave\nName=\"P\"\n");
  const ide::Error error = expectError([&] { ProjectFile::parse(bytes, u"Projeto.vbp"_qs); });
  EXPECT_EQ(error.number(), ide::err::InvalidFileFormat);
  EXPECT_EQ(error.description(),
            QString::fromUtf8("Projeto.vbp, line 3: not a \"Key=value\" line: isto não é uma chave"));

  const ide::Error emptyKey =
      expectError([] { ProjectFile::parse(QByteArray("Type=Exe\r\n=x\r\n"), u"P.vbp"_qs); });
  EXPECT_EQ(emptyKey.description(), u"P.vbp, line 2: not a \"Key=value\" line: =x");

  const ide::Error binary =
      expectError([] { ProjectFile::parse(QByteArray("Type=Exe\r\n\0", 11), u"P.vbp"_qs); });
  EXPECT_EQ(binary.description(), u"P.vbp, line 2: not a text file");

  for (const char* entry : {"Module=modA", "Module=;", "Form=", "ResFile32=\"\""}) {  // no file named
    const QByteArray bytes = "Type=Exe\r\n" + QByteArray(entry) + "\r\n";
    EXPECT_EQ(expectError([&] { ProjectFile::parse(bytes, u"P.vbp"_qs); }).description(),
              u"P.vbp, line 2: the entry names no file: "_qs + entry);
  }
}

TEST(ProjectFileErrorTest, SectionsMayHoldAnything) {
  const QByteArray bytes("Type=Exe\r\n\r\n[Notes]\r\nfree text without a key\r\n");
  const ProjectFile project = ProjectFile::parse(bytes, u"P.vbp"_qs);
  EXPECT_EQ(project.toBytes(u"P.vbp"_qs), bytes);
}

// --- Paths -----------------------------------------------------------------------------------------------

class ProjectPathTest : public ::testing::Test {
 protected:
  void SetUp() override {
    ASSERT_TRUE(m_directory.isValid());
    QDir root(m_directory.path());
    ASSERT_TRUE(root.mkpath(u"Loja/Classes"_qs));
    ASSERT_TRUE(root.mkpath(u"Utilitarios"_qs));
    for (const char* file :
         {"Loja/modPrincipal.bas", "Loja/Classes/clsCliente.cls", "Utilitarios/Utilitarios.vbp"}) {
      QFile touch(root.filePath(QString::fromLatin1(file)));
      ASSERT_TRUE(touch.open(QIODevice::WriteOnly));
    }
  }
  QString local(const char* relative) const { return m_directory.filePath(QString::fromLatin1(relative)); }

  QTemporaryDir m_directory;
};

TEST_F(ProjectPathTest, ResolvesBackslashPathsMatchingNamesCaseInsensitively) {
  const std::pair<const char*, QString> cases[] = {
      {"modPrincipal.bas", local("Loja/modPrincipal.bas")},
      {"Classes\\clsCliente.cls", local("Loja/Classes/clsCliente.cls")},
      {"..\\Utilitarios\\Utilitarios.vbp", local("Utilitarios/Utilitarios.vbp")},
      {".\\Classes\\..\\modPrincipal.bas", local("Loja/modPrincipal.bas")},
      // Another letter case where the exact one is missing.
      {"MODPRINCIPAL.BAS", local("Loja/modPrincipal.bas")},
      {"classes\\CLSCLIENTE.cls", local("Loja/Classes/clsCliente.cls")},
      {"..\\utilitarios\\utilitarios.VBP", local("Utilitarios/Utilitarios.vbp")},
      // Missing files come back as written; drive and network paths cannot be resolved.
      {"Novo\\frmNovo.frm", local("Loja/Novo/frmNovo.frm")},
      {"CLASSES\\clsNovo.cls", local("Loja/CLASSES/clsNovo.cls")},
      {"C:\\Windows\\System32\\MSCOMCTL.OCX", u"C:/Windows/System32/MSCOMCTL.OCX"_qs},
      {"\\\\servidor\\fontes\\a.bas", u"//servidor/fontes/a.bas"_qs},
  };
  for (const auto& [written, expected] : cases)
    EXPECT_EQ(resolveProjectPath(local("Loja"), QString::fromLatin1(written)), expected) << written;
}

TEST_F(ProjectPathTest, PrefersTheExactCase) {
  QFile other(local("Loja/MODPRINCIPAL.BAS"));
  ASSERT_TRUE(other.open(QIODevice::WriteOnly));
  EXPECT_EQ(resolveProjectPath(local("Loja"), u"MODPRINCIPAL.BAS"_qs), local("Loja/MODPRINCIPAL.BAS"));
  EXPECT_EQ(resolveProjectPath(local("Loja"), u"modPrincipal.bas"_qs), local("Loja/modPrincipal.bas"));
}

TEST_F(ProjectPathTest, WritesPathsRelativeWithBackslashes) {
  const QString project = local("Loja");
  EXPECT_EQ(projectRelativePath(project, local("Loja/modPrincipal.bas")), u"modPrincipal.bas");
  EXPECT_EQ(projectRelativePath(project, local("Loja/Classes/clsCliente.cls")), u"Classes\\clsCliente.cls");
  EXPECT_EQ(projectRelativePath(project, local("Utilitarios/Utilitarios.vbp")),
            u"..\\Utilitarios\\Utilitarios.vbp");
  // Round trip.
  EXPECT_EQ(resolveProjectPath(project, projectRelativePath(project, local("Utilitarios/Utilitarios.vbp"))),
            local("Utilitarios/Utilitarios.vbp"));
}

}  // namespace
}  // namespace host
