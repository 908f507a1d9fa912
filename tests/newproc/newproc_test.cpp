// SPDX-License-Identifier: MIT
// The new-procedure wizard over a saved project (Windows-1252 files with CR LF line ends, named in another
// letter case than the project says): its rules and what it writes as the IDE reads it back, then its dialog
// on the offscreen platform, down to the failures that must leave the user's code as it was.
#include "newproc/frmnewproc.h"
#include "newproc/procgen.h"
#include "newproc/procwriter.h"

#include "appdata/appinfofile.h"
#include "common/errors.h"
#include "common/strings.h"
#include "host/model/objects.h"
#include "host/model/vbe.h"
#include "host/platform/headlessui.h"
#include "testproject.h"
#include "textins/textinsertion.h"

#include "printers.h"

#include <gtest/gtest.h>

#include <QTest>
#include <QtWidgets>

namespace newproc::test {
namespace {

using ide::ProcKind;

struct Workspace {
  QTemporaryDir dir;
  std::shared_ptr<host::VbeImpl> vbe = host::VbeImpl::create(), fresh;
  common::SettingsStore settings{dir.filePath(u"Quimbel.ini"_qs)};
  appdata::CAppInfoFile appInfo;
  int lastWindowType = 0;
  bool running = false;
  int helpShown = 0;
  textins::TextInsertion insertion{*vbe,
                                   {u"PC-01"_qs, u"ana"_qs, [this] { return lastWindowType; },
                                    QLocale(QLocale::Portuguese, QLocale::Brazil),
                                    [] { return QDateTime(QDate(2024, 3, 7), QTime(14, 5, 9)); }}};

  std::optional<host::test::ExampleCopy> examples;

  /// With `onExamples`, the example group instead of the project below.
  explicit Workspace(bool onExamples = false) {
    if (onExamples) {
      vbe->setActiveVBProject(vbe->open(examples.emplace().groupFile()).front());
      appInfo.OpenFile(dir.path());
      return;
    }
    // clang-format off
    host::test::writeBytes(dir.filePath(u"VENDAS.BAS"_qs), QStringEncoder("Windows-1252")(
        u"Attribute VB_Name = \"modVendas\"\r\nOption Explicit\r\n' Módulo de vendas: preços em R$\r\n"
        u"Private Const TAXA As Double = 0.1\r\nPublic Name As String\r\n\r\n"
        u"Public Function Total(ByVal Valor As Currency) As Currency\r\n10      Total = Valor * (1 + TAXA)\r\n"
        u"20      If Total < 0 Then GoTo 40\r\n30      Exit Function\r\n40      Total = 0\r\nEnd Function\r\n\r\n\r\n"_qs));
    host::test::writeBytes(dir.filePath(u"Clientes.cls"_qs),
        "VERSION 1.0 CLASS\r\nBEGIN\r\n  MultiUse = -1  'True\r\nEND\r\nAttribute VB_Name = \"Clientes\"\r\n"
        "Attribute VB_Exposed = False\r\nOption Explicit\r\nPrivate mCol As Collection\r\n\r\n"
        "Public Property Get Item(ByVal Index As Variant) As Object\r\nAttribute Item.VB_UserMemId = 0\r\n"
        "    Set Item = mCol(Index)\r\nEnd Property\r\n\r\nPublic Function Count() As Long\r\n"
        "Attribute Count.VB_UserMemId = 1\r\n    Count = mCol.Count\r\nEnd Function\r\n");
    host::test::writeBytes(dir.filePath(u"Loja.vbp"_qs),
        "Type=Exe\r\nModule=modVendas; vendas.bas\r\nClass=Clientes; CLIENTES.CLS\r\nName=\"Loja\"\r\n");
    // clang-format on
    vbe->setActiveVBProject(vbe->open(dir.filePath(u"Loja.vbp"_qs)).front());
    appInfo.OpenFile(dir.path());
  }
  /// The component's code window, opened, active and selected.
  ide::Ref<ide::CodeModule> open(const QString& component) {
    auto found = vbe->ActiveVBProject()->VBComponents()->Item(component);
    found->CodeModule()->CodePane()->Show();
    vbe->selectComponent(std::dynamic_pointer_cast<host::ComponentImpl>(found));
    return found->CodeModule();
  }
  /// The component as saved, opened in a fresh IDE.
  ide::Ref<ide::CodeModule> reopened(const QString& component) {
    vbe->saveAll();
    fresh = host::VbeImpl::create();
    const QString file = examples ? examples->groupFile() : dir.filePath(u"Loja.vbp"_qs);
    return fresh->open(file).front()->VBComponents()->Item(component)->CodeModule();
  }
  QString file(const QString& name) const {
    return QStringDecoder("Windows-1252")(host::test::readBytes(dir.filePath(name)));
  }
  NewProcServices services() {
    return {vbe, settings, &appInfo, {}, insertion, [this] { return running; }, [this] { ++helpShown; }};
  }
  /// The message boxes shown since the last call.
  QStringList prompts() {
    QStringList shown;
    for (const auto& box : vbe->headlessUi()->messageBoxes())
      shown << box.prompt;
    vbe->headlessUi()->clearMessageBoxes();
    return shown;
  }
};

/// The lines of a module from `from` on, joined by "|".
QString linesFrom(ide::CodeModule& module, int from) {
  return module.Lines(from, module.CountOfLines() - from + 1).replace(u"\r\n"_qs, u"|"_qs);
}

NewProcChoices property(const QString& name, const QString& type) {
  NewProcChoices choices{name, ProcType::Property, ProcScope::Private, false, type};
  choices.memberVariable = u"m_"_qs + name;
  choices.get = choices.let = true;
  return choices;
}

TEST(NewProcNames, AreVbIdentifiersAndTypesAreVbTypes) {
  const QString longest(kMaxIdentifierLength, u'a');
  for (const QString& name : {u"Teste"_qs, u"Ação_2"_qs, u"Name"_qs, u"Print_"_qs, longest})
    EXPECT_TRUE(IsVbIdentifier(name) && IsVbTypeName(name)) << name.toStdString();
  for (const QString& name : {longest + u'a', u"1Total"_qs, u"_x"_qs, u"a-b"_qs, u"x$y"_qs, u"a b"_qs, u""_qs,
                              u"Éxito"_qs, u"Sub"_qs, u"nOTHING"_qs, u"Decimal"_qs, u"A.B.C"_qs})
    EXPECT_FALSE(IsVbIdentifier(name) || IsVbTypeName(name)) << name.toStdString();
  for (const QString& type : {u"m.x"_qs, u"Long"_qs, u"object"_qs, u"ADODB.Recordset"_qs})
    EXPECT_TRUE(IsVbTypeName(type) && !IsVbIdentifier(type)) << type.toStdString();
}

TEST(NewProcValidation, ChecksInTheirOrderAndSaysWhereTheFocusGoes) {
  const struct {
    std::function<void(NewProcChoices&)> change;
    QString errorHandler;
    int message;  // 0: none
    Field field = Field::Name;
  } cases[] = {
      // clang-format off
      {[](auto&) {}, u"  \r\n"_qs, 5102, Field::ErrorHandler},
      {[](auto& c) { c.docHeader = true; }, u"x"_qs, 5104, Field::DocHeader},
      {[](auto& c) { c.name = u"Sub"_qs; }, u"x"_qs, 5105},
      {[](auto& c) { c.type = ProcType::Function, c.name = u"Ret"_qs; }, u"x"_qs, 5105},
      {[](auto& c) { c.dataType = u"  "_qs; }, u"x"_qs, 5106, Field::DataType},
      {[](auto& c) { c.type = ProcType::Function, c.dataType = u"Long Long"_qs; }, u"x"_qs, 5106, Field::DataType},
      {[](auto& c) { c.type = ProcType::Function, c.dataType = u" "_qs; }, u"x"_qs, 0},
      {[](auto& c) { c.type = ProcType::Sub, c.dataType = u"?"_qs; }, u"x"_qs, 0},
      {[](auto& c) { c.memberVariable = u"preço"_qs; }, u"x"_qs, 5107, Field::MemberVariable},
      {[](auto& c) { c.memberVariable = u"newvalue"_qs; }, u"x"_qs, 5107, Field::MemberVariable},
      {[](auto& c) { c.get = c.let = false; }, u"x"_qs, 5108, Field::PropertyProcs},
      {[](auto& c) { c.dataType = u"Variant"_qs, c.isObject = true; }, u"x"_qs, 5109, Field::PropertyProcs},
      {[](auto& c) { c.dataType = u"variant "_qs, c.isObject = c.set = true; }, u"x"_qs, 0},
      // clang-format on
  };
  for (const auto& c : cases) {
    NewProcChoices choices = property(u"Preço"_qs, u"Currency"_qs);
    choices.name = u" Preço "_qs;
    choices.errorHandler = true;
    c.change(choices);
    const auto refusal = Validate(choices, c.errorHandler, u"\r\n"_qs);
    ASSERT_EQ(refusal.has_value(), c.message != 0) << c.message;
    if (!refusal) continue;
    EXPECT_TRUE(refusal->message.endsWith(common::LoadResString(c.message))) << c.message;
    EXPECT_EQ(refusal->field, c.field) << c.message;
  }
  EXPECT_EQ(Validate({u"A"_qs, ProcType::Sub, {}, {}, {}, {}, {}, {}, {}, {}, true}, {}, {})->message,
            u"\"Tratar Erro\" foi selecionado, mas nenhum código de tratamento foi informado."_qs);
}

// Each kind, written into the class with an error-handler template and read back from the saved file.
TEST(NewProcWriter, EachKindLineForLineAndLoadedBackWithTheIdesExtents) {
  const struct {
    NewProcChoices choices;
    ProcKind kind;
    const char16_t* lines;
  } cases[] = {
      // clang-format off
      {{u"Limpar"_qs, ProcType::Sub, ProcScope::Private, true}, ProcKind::Proc,
       u"Private Static Sub Limpar()||\t' Entre com o código aqui ||End Sub"},
      {{u"Teste"_qs, ProcType::Sub, ProcScope::Public, false, {}, false, false, false, false, {}, true}, ProcKind::Proc,
       u"Public Sub Teste()||\tOn Error GoTo ErrorHandler||\t' Entre com o código aqui ||\tExit Sub|ErrorHandler:|End Sub"},
      {{u"Abrir"_qs, ProcType::Function, ProcScope::Friend, false, u"Object"_qs, true, false, false, false, {}, true},
       ProcKind::Proc,
       u"Friend Function Abrir() As Object||\tOn Error GoTo ErrorHandler||\tDim ret As Object||"
       u"\t' Entre com o código aqui ||\tSet Abrir= ret||\tExit Function|ErrorHandler:|End Function"},
      {{u"Soma"_qs, ProcType::Function, ProcScope::Private, false, u" "_qs}, ProcKind::Proc,
       u"Private Function Soma() As Variant||\tDim ret As Variant||\t' Entre com o código aqui ||\tSoma= ret||End Function"},
      {{u"Cliente"_qs, ProcType::Property, ProcScope::Public, false, u"Object"_qs, false, true, false, false,
        u"m_Cliente"_qs, true}, ProcKind::Get,
       u"Public Property Get Cliente() As Object||\tOn Error GoTo ErrorHandler||\tSet Cliente = m_Cliente||"
       u"\tExit Property|ErrorHandler:|End Property"},
      {{u"Nome"_qs, ProcType::Property, ProcScope::Private, true, u"String"_qs, false, false, true, false, u"mNome"_qs},
       ProcKind::Let, u"Private Static Property Let Nome(NewValue As String)||\tmNome = newValue||End Property"},
      {{u"Pedido"_qs, ProcType::Property, ProcScope::Friend, false, u"Cliente"_qs, true, false, false, true,
        u"m_Pedido"_qs, true}, ProcKind::Set,
       u"Friend Property Set Pedido(NewValue As Cliente)||\tOn Error GoTo ErrorHandler||\tSet m_Pedido = newValue||"
       u"\tExit Property|ErrorHandler:|End Property"},
      // clang-format on
  };
  Workspace work;
  const auto pane = work.open(u"Clientes"_qs)->CodePane();
  int top = 0;
  for (const auto& c : cases) {
    EXPECT_EQ(GenerateProcedure(c.choices, c.kind), QString::fromUtf16(c.lines).replace(u'|', u"\r\n"_qs));
    top = WriteProcedures(*work.vbe, pane, c.choices, {u"\tResume Next"_qs, {}}, work.insertion);
  }
  EXPECT_EQ(pane->TopLine(), top);  // the last procedure written

  const auto saved = work.reopened(u"Clientes"_qs);
  EXPECT_EQ(saved->Lines(2, 4),
            u"Private mCol As Collection\r\nPrivate m_Cliente As Object\r\n"
            u"Private mNome As String\r\nPrivate m_Pedido As Cliente"_qs);
  int line = 14;  // after the class's own procedures
  for (const auto& c : cases) {
    const QString name = c.choices.name;
    const QString text =
        QString::fromUtf16(c.lines).replace(u"ErrorHandler:"_qs, u"ErrorHandler:|\tResume Next"_qs);
    const int count = int(text.count(u'|')) + 1;
    EXPECT_EQ(saved->ProcStartLine(name, c.kind), line) << name.toStdString();
    EXPECT_EQ(saved->ProcBodyLine(name, c.kind), line) << name.toStdString();
    EXPECT_EQ(saved->ProcCountLines(name, c.kind), count) << name.toStdString();
    EXPECT_EQ(saved->Lines(line, count), QString(text).replace(u'|', u"\r\n"_qs));
    line += count;
  }
  EXPECT_EQ(top, line - 10);
}

TEST(NewProcWriter, RefusesNamesTheModuleUsesAndMakesAFreshDefault) {
  Workspace work;
  auto sales = work.open(u"modVendas"_qs);
  NewProcChoices juros = property(u"Juros"_qs, u"Double"_qs);
  juros.memberVariable = u"TAXA"_qs;
  EXPECT_EQ(CheckNamesFree(*sales, {u"total"_qs, ProcType::Sub})->message, common::LoadResString(5117));
  EXPECT_EQ(CheckNamesFree(*sales, property(u"Name"_qs, u"String"_qs))->field, Field::Name);
  EXPECT_EQ(CheckNamesFree(*sales, juros)->message, common::LoadResString(5118));

  auto customers = work.open(u"Clientes"_qs);
  NewProcChoices item = property(u"Item"_qs, u"Object"_qs);
  item.get = item.let = false;
  item.set = true;
  EXPECT_FALSE(CheckNamesFree(*customers, item));  // the Set the property lacks
  item.get = true;
  EXPECT_EQ(CheckNamesFree(*customers, item)->field, Field::Name);

  NewProcChoices imprimir{u"Imprimir"_qs, ProcType::Sub};
  imprimir.isDefault = true;
  WriteProcedures(*work.vbe, customers->CodePane(), imprimir, {}, work.insertion);
  work.reopened(u"Clientes"_qs);
  const QString text = work.file(u"Clientes.cls"_qs);
  EXPECT_TRUE(text.contains(u"Attribute Item.VB_UserMemId = 2\r\n"_qs)) << text.toStdString();
  EXPECT_TRUE(text.contains(u"Attribute Count.VB_UserMemId = 1\r\n"_qs));
  EXPECT_TRUE(text.contains(u"Private Sub Imprimir()\r\nAttribute Imprimir.VB_UserMemId = 0\r\n"_qs));
}

const QString kCreated = u"O procedimento foi criado.\nDeseja criar mais algum?"_qs;

// OK, answering the question that follows a procedure written.
void ok(Workspace& work, frmNewProc& dialog, int answer = ide::mb::No) {
  work.vbe->headlessUi()->queueAnswer(answer);
  dialog.cmdOk()->click();
}

// Enabled (e/d) and ticked (+/-) of the object box, Let and Set; "r" while the object reminder shows.
QString state(const frmNewProc& d) {
  const auto box = [](const QCheckBox* b) {
    return QString(b->isEnabled() ? u'e' : u'd') + (b->isChecked() ? u'+' : u'-');
  };
  return box(d.ckIsObject()) + (d.objectReminderShown() ? u"r "_qs : u" "_qs) + box(d.ckPropLet()) + u' ' +
         box(d.ckPropSet());
}

TEST(NewProcDialog, OpensOnFunctionAndPrivateWithTheStoredOptionsThenItsRulesEnableTheControls) {
  Workspace work;
  work.open(u"modVendas"_qs);
  work.settings.setValue(common::setting::ErrorDocHeaderOnNewProc, u"0"_qs);
  frmNewProc d(work.services());
  EXPECT_EQ(
      d.windowTitle() + d.tabNewProc()->tabText(2) + d.lblType()->text() + d.cboDataType()->currentText(),
      u"Quimbel - Novo ProcedimentoCabeçalho de Docu&mentaçãoTipo de Dado:String"_qs);
  EXPECT_TRUE(d.opType(1)->isChecked() && d.opScope(0)->isChecked() && !d.opScope(2)->isEnabled());
  EXPECT_TRUE(!d.frPropProcs()->isEnabled() && d.txtVariable()->isEnabled() && d.ckDefault()->isEnabled());
  EXPECT_TRUE(d.ckErrHandler()->isChecked() && !d.ckDocHeader()->isChecked());
  EXPECT_EQ(d.txtErrCode()->toPlainText(), appdata::CAppInfoFile::DefaultErrorHandler());

  const auto type = [&](const char16_t* text) { d.cboDataType()->setEditText(QString::fromUtf16(text)); };
  const std::pair<std::function<void()>, const char16_t*> steps[] = {
      // clang-format off
      {[] {}, u"d- d- d-"},
      {[&] { d.opType(2)->click(); }, u"d- e- d-"}, {[&] { d.txtName()->setText(u"Cliente"_qs); }, u"d- e- d-"},
      {[&] { type(u"Object"); }, u"d+ d- e-"}, {[&] { type(u"variant"); }, u"e+ e- e+"},
      {[&] { d.ckIsObject()->click(); }, u"e- e- d-"}, {[&] { type(u"Cliente"); }, u"e-r e- e-"},
      {[&] { d.ckIsObject()->click(); }, u"e+ d- e-"}, {[&] { d.opType(1)->click(); }, u"e+ d- d-"},
      {[&] { type(u"Long"); }, u"d- d- d-"}, {[&] { d.opType(1)->click(); }, u"d-r d- d-"},
      {[&] { d.opType(0)->click(); }, u"d-r d- d-"},
      // clang-format on
  };
  for (size_t i = 0; i < std::size(steps); ++i) {
    steps[i].first();
    EXPECT_EQ(state(d), QString::fromUtf16(steps[i].second)) << "step " << i;
  }
  EXPECT_EQ(d.txtVariable()->text(), u"m_Cliente"_qs);
  EXPECT_FALSE(d.cboDataType()->isEnabled() || d.txtVariable()->isEnabled());
  d.opType(1)->click();
  EXPECT_EQ(d.lblType()->text(), u"Tipo Retornado:"_qs);

  d.cmdHelp()->click();
  EXPECT_EQ(work.helpShown, 1);
  d.ckErrHandler()->click();
  d.cmdCancel()->click();
  EXPECT_EQ(d.result(), QDialog::Rejected);
  EXPECT_EQ(work.settings.value(common::setting::ErrorHandlerOnNewProc), u"0"_qs);
}

// Friend is offered by the module that receives the code, whichever component the Project window selects;
// the names of a form's controls and of a module's Enums, their members and Types are names in use.
TEST(NewProcDialog, OnTheExamplesFriendFollowsTheReceivingModuleAndNamesInUseAreRefused) {
  Workspace work(true);
  const auto select = [&](const char16_t* name) {
    work.vbe->selectComponent(std::dynamic_pointer_cast<host::ComponentImpl>(
        work.vbe->ActiveVBProject()->VBComponents()->Item(QString::fromUtf16(name))));
  };
  work.open(u"frmCliente"_qs);
  select(u"modConstantes");
  EXPECT_TRUE(frmNewProc(work.services()).opScope(2)->isEnabled());
  work.open(u"modConstantes"_qs);
  select(u"clsCliente");
  frmNewProc d(work.services());
  EXPECT_FALSE(d.opScope(2)->isEnabled());
  d.opType(2)->click();
  d.ckPropGet()->setChecked(true);
  const std::tuple<const char16_t*, const char16_t*, const char16_t*, int> cases[] = {
      // clang-format off
      {u"modConstantes", u"SituacaoPedido", u"mX", 5117}, {u"modConstantes", u"spCancelado", u"mX", 5117},
      {u"modConstantes", u"registroCliente", u"mX", 5117}, {u"modConstantes", u"Tipo", u"TPFISICA", 5118},
      {u"modConstantes", u"Tipo", u"mTipo", 0}, {u"frmCliente", u"txtNome", u"mX", 5117},
      {u"frmCliente", u"Nome", u"cboUF", 5118}, {u"frmCliente", u"Nome", u"mNome", 0}};
  // clang-format on
  for (const auto& [module, name, member, message] : cases) {
    work.open(QString::fromUtf16(module));
    d.txtName()->setText(QString::fromUtf16(name));
    d.txtVariable()->setText(QString::fromUtf16(member));
    ok(work, d, ide::mb::Yes);
    EXPECT_EQ(work.prompts(), QStringList{message ? common::LoadResString(message) : kCreated})
        << QString::fromUtf16(name).toStdString();
  }
  for (const QString& module : {u"modConstantes"_qs, u"frmCliente"_qs})
    EXPECT_EQ(host::test::uncompilableLines(*work.reopened(module)->Parent()), QStringList());
  // What the checker refuses: Friend in a standard module, and an Enum member's name.
  const auto constants = work.reopened(u"modConstantes"_qs);
  constants->AddFromString(u"Friend Sub spAberto()\r\nEnd Sub"_qs);
  EXPECT_EQ(host::test::uncompilableLines(*constants->Parent()).size(), 2);
}

TEST(NewProcDialog, PublicSubTesteWithBothTemplatesThenYesKeepsTheChoices) {
  Workspace work;
  auto sales = work.open(u"modVendas"_qs);
  frmNewProc d(work.services());
  d.opType(0)->click();
  d.opScope(1)->click();
  d.ckStatic()->setChecked(true);
  d.ckDefault()->setChecked(true);
  d.txtName()->setText(u"Teste"_qs);
  d.tabNewProc()->setCurrentIndex(2);
  ok(work, d, ide::mb::Yes);
  EXPECT_EQ(work.prompts(), QStringList{kCreated});
  const NewProcChoices kept = d.choices();
  EXPECT_TRUE(kept.name.isEmpty() && !kept.isDefault && kept.isStatic && kept.errorHandler && kept.docHeader);
  EXPECT_TRUE(kept.type == ProcType::Sub && kept.scope == ProcScope::Public &&
              d.tabNewProc()->currentIndex() == 0);
  EXPECT_EQ(linesFrom(*sales, 14),
            u"' *****************************************************|' Módulo: modVendas  |"
            u"' Procedimento: Teste |' Criado por: ana |' Em 07/03/2024 14:05:09|' Propósito: |"
            u"' *****************************************************|Public Static Sub Teste()||"
            u"\tOn Error GoTo ErrorHandler||\t' Entre com o código aqui ||\tExit Sub|ErrorHandler:|"
            u"\tDim errnum as Long|\terrnum = Err.Number|\tErr.Clear|\t' Abaixo, use a numeração de linhas "
            u"do Quimbel para|"
            u"\t' tirar proveito do valor retornado  por  Erl. Sem |\t' numerar as linhas, 0 será retornado.|"
            u"\tMsgBox errnum & \" \" & Error$(errnum) & vbLf & _|\t\t\"Erro em \" & \"modVendas_Teste, "
            u"Linha: \" & Erl|"
            u"End Sub"_qs);
  // The boxes give the templates back with CR LF, so both are written back.
  EXPECT_EQ(work.appInfo.GetProcDocHeader(),
            appdata::CAppInfoFile::DefaultProcDocHeader().replace(u"\n"_qs, u"\r\n"_qs));
  // The blank lines the module ended with are the new procedure's.
  const auto saved = work.reopened(u"modVendas"_qs);
  EXPECT_EQ(saved->ProcStartLine(u"Teste"_qs, ide::ProcKind::Proc), 12);
  EXPECT_EQ(saved->ProcBodyLine(u"Teste"_qs, ide::ProcKind::Proc), 21);
  EXPECT_EQ(saved->ProcCountLines(u"Teste"_qs, ide::ProcKind::Proc), 26);
  EXPECT_TRUE(
      work.file(u"VENDAS.BAS"_qs).contains(u"' Módulo: modVendas  \r\n' Procedimento: Teste \r\n"_qs));
}

TEST(NewProcDialog, RefusedNamesAnObjectPropertyWithGetAndSetAndAVariantOneWithLetAndSet) {
  Workspace work;
  auto sales = work.open(u"modVendas"_qs);
  frmNewProc d(work.services());
  d.show();
  QApplication::setActiveWindow(&d);
  ASSERT_TRUE(QTest::qWaitForWindowActive(&d));
  const QString before = linesFrom(*sales, 1);
  for (const QString& name : {u""_qs, u"a-b"_qs, u"TOTAL"_qs}) {  // the last one names Total
    d.txtName()->setText(name);
    d.tabNewProc()->setCurrentIndex(1);
    d.cmdOk()->click();
    EXPECT_EQ(work.prompts(), QStringList{common::LoadResString(name == u"TOTAL"_qs ? 5117 : 5105)});
    EXPECT_TRUE(d.tabNewProc()->currentIndex() == 0 && d.txtName()->hasFocus());
  }
  EXPECT_EQ(linesFrom(*sales, 1), before);

  d.ckErrHandler()->setChecked(false);
  d.ckDocHeader()->setChecked(false);
  d.opType(2)->click();
  d.txtName()->setText(u"X"_qs);
  d.cboDataType()->setEditText(u"Object"_qs);
  d.ckPropGet()->setChecked(true);
  d.ckPropSet()->setChecked(true);
  ok(work, d, ide::mb::Yes);
  EXPECT_EQ(work.prompts(), QStringList{kCreated});
  EXPECT_EQ(sales->Lines(5, 1), u"Private m_X As Object"_qs);
  EXPECT_EQ(linesFrom(*sales, 15),
            u"Private Property Get X() As Object||\tSet X = m_X||End Property|"
            u"Private Property Set X(NewValue As Object)||\tSet m_X = newValue||End Property"_qs);

  const QString written = linesFrom(*sales, 1);
  d.txtName()->setText(u"V"_qs);
  d.cboDataType()->setEditText(u"Variant"_qs);
  d.ckPropSet()->setChecked(false);
  d.ckPropLet()->setChecked(true);
  d.cmdOk()->click();
  EXPECT_EQ(work.prompts(), QStringList{common::LoadResString(5109)});
  EXPECT_EQ(linesFrom(*sales, 1), written);
  d.ckPropSet()->setChecked(true);
  ok(work, d);
  EXPECT_EQ(work.prompts(), QStringList{kCreated});
  EXPECT_EQ(sales->ProcBodyLine(u"V"_qs, ide::ProcKind::Set), sales->CountOfLines() - 4);
  EXPECT_EQ(d.result(), QDialog::Accepted);  // No closes the dialog
}

TEST(NewProcDialog, NoPaneRunningProgramAndDatabaseFailuresLeaveTheCode) {
  Workspace work;
  EXPECT_EQ(frmNewProc(work.services()).exec(), QDialog::Rejected);
  showNewProcedureDialog(work.services());
  EXPECT_TRUE(work.prompts().isEmpty());

  auto sales = work.open(u"modVendas"_qs);
  const QString before = linesFrom(*sales, 1);
  work.running = true;
  showNewProcedureDialog(work.services());
  EXPECT_EQ(work.prompts(), QStringList{common::LoadResString(5100)});
  EXPECT_EQ(common::lastError().number, ide::err::CannotEdit);

  frmNewProc d(work.services());
  d.opType(0)->click();
  d.txtName()->setText(u"Gravar"_qs);
  d.txtErrCode()->setPlainText(u"\tResume Next"_qs);
  work.appInfo.CloseFileInfo();
  d.cmdOk()->click();
  EXPECT_EQ(work.prompts(), QStringList{common::LoadResString(5100)});
  EXPECT_EQ(common::lastError().number, appdata::kAppDataError);
  EXPECT_EQ(linesFrom(*sales, 1), before);
  // Told once: the next OK writes the procedure with the templates as edited.
  ok(work, d, ide::mb::Yes);
  EXPECT_EQ(work.prompts(), QStringList{kCreated});
  EXPECT_EQ(linesFrom(*sales, sales->CountOfLines() - 2), u"ErrorHandler:|\tResume Next|End Sub"_qs);

  // Templates that cannot go in leave the procedure whole: a line past the IDE's limit is refused as the
  // text insertion reports; a marker that goes away leaves its line break.
  work.appInfo.OpenFile(work.dir.path());
  const std::tuple<QString, int, QStringList, QString> cases[] = {
      // clang-format off
      {u"{ModuleName}"_qs + QString(1015, u'x'), 0, {common::LoadResString(5096), kCreated},
       u"\tExit Sub|ErrorHandler:|End Sub"_qs},
      {u"{C}"_qs, -1, {kCreated}, u"ErrorHandler:||End Sub"_qs}};
  // clang-format on
  for (const auto& [handler, lastWindowType, prompts, lines] : cases) {
    work.lastWindowType = lastWindowType;
    d.txtName()->setText(u"Salvar"_qs + QString::number(lastWindowType + 1));
    d.txtErrCode()->setPlainText(handler);
    ok(work, d, ide::mb::Yes);
    EXPECT_EQ(work.prompts(), prompts);
    EXPECT_EQ(linesFrom(*sales, sales->CountOfLines() - 2), lines);
  }
}

}  // namespace
}  // namespace newproc::test
