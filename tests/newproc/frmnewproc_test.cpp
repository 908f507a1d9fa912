// SPDX-License-Identifier: MIT
// The new-procedure wizard on the offscreen platform: how it opens, the kind, type and object rules, what OK
// writes with the stock templates, the refusals, Yes for another procedure, and the failures that must
// leave the user's code as it was.
#include "newproc/frmnewproc.h"

#include "common/errors.h"
#include "common/strings.h"
#include "wizardfixture.h"

#include "printers.h"

#include <gtest/gtest.h>

#include <QApplication>
#include <QCheckBox>
#include <QComboBox>
#include <QGroupBox>
#include <QLabel>
#include <QLineEdit>
#include <QPlainTextEdit>
#include <QPushButton>
#include <QRadioButton>
#include <QTabWidget>
#include <QTest>

namespace newproc::test {
namespace {

const QString kCreated = u"O procedimento foi criado.\nDeseja criar mais algum?"_qs;

// OK, answering the question that follows a procedure written.
void ok(Workspace& work, frmNewProc& dialog, int answer = ide::mb::No) {
  work.vbe->headlessUi()->queueAnswer(answer);
  dialog.cmdOk()->click();
}

QString code(ide::CodeModule& module) {
  return module.Lines(1, module.CountOfLines());
}

// Enabled (e/d) and ticked (+/-) of the object box, Let and Set; "r" while the object reminder shows.
QString state(const frmNewProc& d) {
  const auto box = [](const QCheckBox* b) {
    return QString(b->isEnabled() ? u'e' : u'd') + (b->isChecked() ? u'+' : u'-');
  };
  return box(d.ckIsObject()) + (d.objectReminderShown() ? u"r "_qs : u" "_qs) + box(d.ckPropLet()) + u' ' +
         box(d.ckPropSet());
}

TEST(NewProcDialog, OpensOnFunctionAndPrivateWithTheStoredOptions) {
  Workspace work;
  work.open(u"modVendas"_qs);
  work.settings.setValue(common::setting::ErrorDocHeaderOnNewProc, u"0"_qs);
  frmNewProc d(work.services());
  EXPECT_EQ(d.windowTitle(), u"Quimbel - Novo Procedimento"_qs);
  EXPECT_EQ(d.tabNewProc()->tabText(2), u"Cabeçalho de Docu&mentação"_qs);
  EXPECT_EQ(d.lblType()->text(), u"Tipo de Dado:"_qs);
  EXPECT_TRUE(d.opType(1)->isChecked() && d.opScope(0)->isChecked() && !d.opScope(2)->isEnabled());
  EXPECT_EQ(d.cboDataType()->currentText(), u"String"_qs);
  EXPECT_EQ(state(d), u"d- d- d-"_qs);
  EXPECT_TRUE(!d.frPropProcs()->isEnabled() && d.txtVariable()->isEnabled() && d.ckDefault()->isEnabled());
  EXPECT_TRUE(d.ckErrHandler()->isChecked() && !d.ckDocHeader()->isChecked());
  EXPECT_EQ(d.txtErrCode()->toPlainText(), appdata::CAppInfoFile::DefaultErrorHandler());
  d.cmdHelp()->click();
  EXPECT_EQ(work.helpShown, 1);
  d.ckErrHandler()->click();
  d.cmdCancel()->click();
  EXPECT_EQ(d.result(), QDialog::Rejected);
  EXPECT_EQ(work.settings.value(common::setting::ErrorHandlerOnNewProc), u"0"_qs);
  work.open(u"Clientes"_qs);
  EXPECT_TRUE(frmNewProc(work.services()).opScope(2)->isEnabled());  // Friend, in a class
}

TEST(NewProcDialog, KindTypeAndObjectRulesEnableTheControls) {
  Workspace work;
  work.open(u"modVendas"_qs);
  frmNewProc d(work.services());
  const auto type = [&](const char16_t* text) { d.cboDataType()->setEditText(QString::fromUtf16(text)); };
  const std::pair<std::function<void()>, const char16_t*> steps[] = {
      // clang-format off
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
}

TEST(NewProcDialog, PublicSubTesteWithBothTemplates) {
  Workspace work;
  auto sales = work.open(u"modVendas"_qs);
  frmNewProc d(work.services());
  d.opType(0)->click();
  d.opScope(1)->click();
  d.txtName()->setText(u"Teste"_qs);
  ok(work, d);
  EXPECT_EQ(work.prompts(), QStringList{kCreated});
  EXPECT_EQ(d.result(), QDialog::Accepted);
  EXPECT_EQ(linesFrom(*sales, 14),
            u"' *****************************************************|' Módulo: modVendas  |"
            u"' Procedimento: Teste |' Criado por: ana |' Em 07/03/2024 14:05:09|' Propósito: |"
            u"' *****************************************************|Public Sub Teste()||"
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

TEST(NewProcDialog, ObjectPropertyWithGetAndSetAndAVariantOneNeedsLetAndSet) {
  Workspace work;
  auto sales = work.open(u"modVendas"_qs);
  frmNewProc d(work.services());
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

  const QString before = code(*sales);
  d.txtName()->setText(u"V"_qs);
  d.cboDataType()->setEditText(u"Variant"_qs);
  d.ckPropSet()->setChecked(false);
  d.ckPropLet()->setChecked(true);
  d.cmdOk()->click();
  EXPECT_EQ(work.prompts(), QStringList{common::LoadResString(5109)});
  EXPECT_EQ(code(*sales), before);
  d.ckPropSet()->setChecked(true);
  ok(work, d);
  EXPECT_EQ(work.prompts(), QStringList{kCreated});
  EXPECT_EQ(sales->ProcBodyLine(u"V"_qs, ide::ProcKind::Set), sales->CountOfLines() - 4);
}

TEST(NewProcDialog, RefusedNamesPutTheFocusBackAndWriteNothing) {
  Workspace work;
  auto sales = work.open(u"modVendas"_qs);
  frmNewProc d(work.services());
  d.show();
  QApplication::setActiveWindow(&d);
  ASSERT_TRUE(QTest::qWaitForWindowActive(&d));
  const QString before = code(*sales), invalid = common::LoadResString(5105);
  for (const auto& [name, message] : {std::pair{u""_qs, invalid},
                                      {u"a-b"_qs, invalid},
                                      {u"Sub"_qs, invalid},
                                      {u"TOTAL"_qs, common::LoadResString(5117)}}) {
    d.txtName()->setText(name);
    d.tabNewProc()->setCurrentIndex(1);
    d.cmdOk()->click();
    EXPECT_EQ(work.prompts(), QStringList{message}) << name.toStdString();
    EXPECT_TRUE(d.tabNewProc()->currentIndex() == 0 && d.txtName()->hasFocus());
  }
  EXPECT_EQ(code(*sales), before);
}

TEST(NewProcDialog, YesKeepsTheChoicesForTheNextProcedure) {
  Workspace work;
  auto customers = work.open(u"Clientes"_qs);
  frmNewProc d(work.services());
  d.opScope(2)->click();
  d.ckStatic()->setChecked(true);
  d.ckErrHandler()->setChecked(false);
  d.cboDataType()->setEditText(u"Long"_qs);
  d.ckDefault()->setChecked(true);
  d.txtName()->setText(u"Dobro"_qs);
  d.tabNewProc()->setCurrentIndex(2);
  ok(work, d, ide::mb::Yes);
  EXPECT_EQ(d.tabNewProc()->currentIndex(), 0);
  const NewProcChoices kept = d.choices();
  EXPECT_TRUE(kept.name.isEmpty() && !kept.isDefault && !kept.errorHandler && kept.isStatic);
  EXPECT_TRUE(kept.type == ProcType::Function && kept.scope == ProcScope::Friend &&
              kept.dataType == u"Long"_qs);
  EXPECT_EQ(customers->Members()->Item(u"Dobro"_qs)->ProcedureId(), 0);
  EXPECT_EQ(customers->Members()->Item(u"Item"_qs)->ProcedureId(), 2);  // 1 is Count's
}

TEST(NewProcDialog, NoPaneRunningProgramAndDatabaseFailuresLeaveTheCode) {
  Workspace work;
  EXPECT_EQ(frmNewProc(work.services()).exec(), QDialog::Rejected);
  showNewProcedureDialog(work.services());
  EXPECT_TRUE(work.prompts().isEmpty());

  auto sales = work.open(u"modVendas"_qs);
  const QString before = code(*sales);
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
  EXPECT_EQ(code(*sales), before);
  // Told once: the next OK writes the procedure with the templates as edited.
  ok(work, d);
  EXPECT_EQ(work.prompts(), QStringList{kCreated});
  EXPECT_EQ(sales->Lines(sales->CountOfLines() - 1, 1), u"\tResume Next"_qs);
}

TEST(NewProcDialog, TemplatesThatCannotGoInLeaveTheProcedureWhole) {
  const struct {
    QString errorHandler;
    int lastWindowType;
    QStringList prompts;
    QString handlerLines;
  } cases[] = {
      {u"{ModuleName}"_qs + QString(1015, u'x'), 0, {common::LoadResString(5096), kCreated}, {}},  // too long
      {u"{C}"_qs, -1, {kCreated}, u"|"_qs},  // the marker goes away, the line break stays
  };
  for (const auto& c : cases) {
    Workspace work;
    auto sales = work.open(u"modVendas"_qs);
    work.lastWindowType = c.lastWindowType;
    frmNewProc d(work.services());
    d.opType(0)->click();
    d.ckDocHeader()->setChecked(false);
    d.txtName()->setText(u"Salvar"_qs);
    d.txtErrCode()->setPlainText(c.errorHandler);
    ok(work, d);
    EXPECT_EQ(work.prompts(), c.prompts);
    EXPECT_EQ(linesFrom(*sales, 20), u"\tExit Sub|ErrorHandler:|"_qs + c.handlerLines + u"End Sub"_qs);
  }
}

}  // namespace
}  // namespace newproc::test
