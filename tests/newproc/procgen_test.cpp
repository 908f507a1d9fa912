// SPDX-License-Identifier: MIT
// What the wizard writes, without its dialog: the names it takes, the order of its checks, each kind of
// procedure line for line as the IDE reads it back from the saved class, the names it refuses and the
// default member.
#include "newproc/procgen.h"
#include "newproc/procwriter.h"

#include "common/strings.h"
#include "wizardfixture.h"

#include "printers.h"

#include <gtest/gtest.h>

namespace newproc::test {
namespace {

using ide::ProcKind;

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
      {[](auto& c) { c.memberVariable = u"m_Preço x"_qs; }, u"x"_qs, 5107, Field::MemberVariable},
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
  NewProcChoices handled{u"A"_qs};
  handled.errorHandler = true;
  EXPECT_EQ(Validate(handled, {}, {})->message,
            u"\"Tratar Erro\" foi selecionado, mas nenhum código de tratamento foi informado."_qs);
}

// Each kind is written into the collection class after the other, with an error-handler template, then
// read back from the saved file: its lines as the table says and the extents the IDE gives.
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
  EXPECT_EQ(pane->TopLine(), top);

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

}  // namespace
}  // namespace newproc::test
