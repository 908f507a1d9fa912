// SPDX-License-Identifier: MIT
// What the wizard writes, without its dialog: the names it takes, the order of its checks, each kind of
// procedure line for line, and the procedures as the IDE reads them back from the saved module.
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
  NewProcChoices choices;
  choices.name = name;
  choices.type = ProcType::Property;
  choices.dataType = type;
  choices.memberVariable = QStringLiteral("m_") + name;
  choices.get = choices.let = true;
  return choices;
}

TEST(NewProcNames, AreVbIdentifiersAndTypesAreVbTypes) {
  const QString longest(kMaxIdentifierLength, u'a');
  const struct {
    QString text;
    bool identifier;
    bool type;
  } cases[] = {
      {u"Teste"_qs, true, true},     {u"Ação_2"_qs, true, true},
      {u"Name"_qs, true, true},      {u"Print_"_qs, true, true},
      {longest, true, true},         {longest + u'a', false, false},
      {u"1Total"_qs, false, false},  {u"_x"_qs, false, false},
      {u"a-b"_qs, false, false},     {u"x$y"_qs, false, false},
      {u"a b"_qs, false, false},     {u"m.x"_qs, false, true},
      {u""_qs, false, false},        {u"Éxito"_qs, false, false},
      {u"Sub"_qs, false, false},     {u"nOTHING"_qs, false, false},
      {u"Long"_qs, false, true},     {u"object"_qs, false, true},
      {u"Decimal"_qs, false, false}, {u"ADODB.Recordset"_qs, false, true},
      {u"A.B.C"_qs, false, false},
  };
  for (const auto& c : cases) {
    EXPECT_EQ(IsVbIdentifier(c.text), c.identifier) << c.text.toStdString();
    EXPECT_EQ(IsVbTypeName(c.text), c.type) << c.text.toStdString();
  }
}

TEST(NewProcValidation, ChecksInTheirOrderAndSaysWhereTheFocusGoes) {
  const auto text = [](int id) { return common::LoadResString(id); };
  const struct {
    std::function<void(NewProcChoices&)> change;
    QString errorHandler;
    std::optional<QString> message;
    Field field = Field::Name;
  } cases[] = {
      {[](auto&) {}, u"  \r\n"_qs,
       u"\"Tratar Erro\" foi selecionado, mas nenhum código de tratamento foi informado."_qs,
       Field::ErrorHandler},
      {[](auto& c) { c.docHeader = true; }, u"x"_qs,
       u"\"Cabeçalho Documentação\" foi selecionado, mas nenhum cabeçalho foi informado."_qs,
       Field::DocHeader},
      {[](auto& c) { c.name = u"Sub"_qs; }, u"x"_qs, text(5105)},
      {[](auto& c) { c.type = ProcType::Function, c.name = u"Ret"_qs; }, u"x"_qs, text(5105)},
      {[](auto& c) { c.dataType = u"  "_qs; }, u"x"_qs, text(5106), Field::DataType},
      {[](auto& c) { c.type = ProcType::Function, c.dataType = u"Long Long"_qs; }, u"x"_qs, text(5106),
       Field::DataType},
      {[](auto& c) { c.type = ProcType::Function, c.dataType = u" "_qs; }, u"x"_qs, std::nullopt},
      {[](auto& c) { c.type = ProcType::Sub, c.dataType = u"?"_qs; }, u"x"_qs, std::nullopt},
      {[](auto& c) { c.memberVariable = u"m_Preço x"_qs; }, u"x"_qs, text(5107), Field::MemberVariable},
      {[](auto& c) { c.memberVariable = u"preço"_qs; }, u"x"_qs, text(5107), Field::MemberVariable},
      {[](auto& c) { c.memberVariable = u"newvalue"_qs; }, u"x"_qs, text(5107), Field::MemberVariable},
      {[](auto& c) { c.get = c.let = false; }, u"x"_qs, text(5108), Field::PropertyProcs},
      {[](auto& c) { c.dataType = u"Variant"_qs, c.isObject = true; }, u"x"_qs, text(5109),
       Field::PropertyProcs},
      {[](auto& c) { c.dataType = u"variant "_qs, c.isObject = c.set = true; }, u"x"_qs, std::nullopt},
  };
  for (const auto& c : cases) {
    NewProcChoices choices = property(u"Preço"_qs, u"Currency"_qs);
    choices.name = u" Preço "_qs;
    choices.errorHandler = true;
    c.change(choices);
    const auto refusal = Validate(choices, c.errorHandler, u"\r\n"_qs);
    ASSERT_EQ(refusal.has_value(), c.message.has_value()) << (refusal ? refusal->message.toStdString() : "");
    if (!refusal) continue;
    EXPECT_EQ(refusal->message, *c.message);
    EXPECT_EQ(refusal->field, c.field) << c.message->toStdString();
  }
}

TEST(NewProcText, EachKindLineForLine) {
  const struct {
    NewProcChoices choices;
    ProcKind kind;
    const char16_t* lines;
  } cases[] = {
      {{u"Limpar"_qs, ProcType::Sub, ProcScope::Private, true},
       ProcKind::Proc,
       u"Private Static Sub Limpar()||\t' Entre com o código aqui ||End Sub"},
      {{u"Teste"_qs, ProcType::Sub, ProcScope::Public, false, {}, false, false, false, false, {}, true},
       ProcKind::Proc,
       u"Public Sub Teste()||\tOn Error GoTo ErrorHandler||\t' Entre com o código aqui ||\tExit Sub|"
       u"ErrorHandler:|End Sub"},
      {{u"Abrir"_qs,
        ProcType::Function,
        ProcScope::Friend,
        false,
        u"Object"_qs,
        true,
        false,
        false,
        false,
        {},
        true},
       ProcKind::Proc,
       u"Friend Function Abrir() As Object||\tOn Error GoTo ErrorHandler||\tDim ret As Object||"
       u"\t' Entre com o código aqui ||\tSet Abrir= ret||\tExit Function|ErrorHandler:|End Function"},
      {{u"Soma"_qs, ProcType::Function, ProcScope::Private, false, u" "_qs},
       ProcKind::Proc,
       u"Private Function Soma() As Variant||\tDim ret As Variant||\t' Entre com o código aqui ||"
       u"\tSoma= ret||End Function"},
      {{u"Cliente"_qs, ProcType::Property, ProcScope::Public, false, u"Object"_qs, false, true, false, true,
        u"m_Cliente"_qs, true},
       ProcKind::Get,
       u"Public Property Get Cliente() As Object||\tOn Error GoTo ErrorHandler||\tSet Cliente = m_Cliente||"
       u"\tExit Property|ErrorHandler:|End Property"},
      {{u"Nome"_qs, ProcType::Property, ProcScope::Private, true, u"String"_qs, false, false, true, false,
        u"mNome"_qs},
       ProcKind::Let,
       u"Private Static Property Let Nome(NewValue As String)||\tmNome = newValue||End Property"},
      {{u"Cliente"_qs, ProcType::Property, ProcScope::Friend, false, u"Cliente"_qs, true, false, false, true,
        u"m_Cliente"_qs, true},
       ProcKind::Set,
       u"Friend Property Set Cliente(NewValue As Cliente)||\tOn Error GoTo ErrorHandler||"
       u"\tSet m_Cliente = newValue||\tExit Property|ErrorHandler:|End Property"},
  };
  for (const auto& c : cases)
    EXPECT_EQ(GenerateProcedure(c.choices, c.kind), QString::fromUtf16(c.lines).replace(u'|', u"\r\n"_qs));
  EXPECT_EQ(MemberDeclaration(cases[4].choices), u"Private m_Cliente As Object"_qs);
}

TEST(NewProcWriter, WhatItWritesLoadsBackWithTheIdesExtents) {
  Workspace work;
  auto module = work.open(u"modVendas"_qs);
  const auto pane = module->CodePane();
  NewProcChoices desconto = property(u"Desconto"_qs, u"Currency"_qs);
  desconto.scope = ProcScope::Public;
  NewProcChoices imprimir{u"Imprimir"_qs, ProcType::Sub};
  imprimir.errorHandler = true;
  EXPECT_EQ(WriteProcedures(*work.vbe, pane, desconto, {}, work.insertion), 20);
  EXPECT_EQ(WriteProcedures(*work.vbe, pane, imprimir, {u"\tResume Next"_qs, {}}, work.insertion), 25);
  EXPECT_EQ(pane->TopLine(), 25);

  const auto saved = work.reopened()->VBComponents()->Item(u"modVendas"_qs)->CodeModule();
  EXPECT_EQ(saved->Lines(5, 1), u"Private m_Desconto As Currency"_qs);
  EXPECT_EQ(linesFrom(*saved, 15),
            QString(u"Public Property Get Desconto() As Currency||\tDesconto = m_Desconto||"
                    u"End Property|Public Property Let Desconto(NewValue As Currency)||"
                    u"\tm_Desconto = newValue||End Property|Private Sub Imprimir()||"
                    u"\tOn Error GoTo ErrorHandler||\t' Entre com o código aqui ||"
                    u"\tExit Sub|ErrorHandler:|\tResume Next|End Sub"_qs)
                .split(u'|'));
  const struct {
    const char16_t* name;
    ProcKind kind;
    int start, body, count;
  } extents[] = {{u"Total", ProcKind::Proc, 6, 7, 7},
                 {u"Desconto", ProcKind::Get, 13, 15, 7},
                 {u"Desconto", ProcKind::Let, 20, 20, 5},
                 {u"Imprimir", ProcKind::Proc, 25, 25, 10}};
  for (const auto& e : extents) {
    const QString name = QString::fromUtf16(e.name);
    EXPECT_EQ(saved->ProcStartLine(name, e.kind), e.start) << name.toStdString();
    EXPECT_EQ(saved->ProcBodyLine(name, e.kind), e.body) << name.toStdString();
    EXPECT_EQ(saved->ProcCountLines(name, e.kind), e.count) << name.toStdString();
  }
  EXPECT_TRUE(work.file(u"VENDAS.BAS"_qs).contains(u"' Módulo de vendas: preços em R$\r\n"_qs));
}

TEST(NewProcWriter, RefusesNamesTheModuleUsesAndMakesAFreshDefault) {
  Workspace work;
  auto sales = work.open(u"modVendas"_qs);
  NewProcChoices sub{u"total"_qs, ProcType::Sub};
  NewProcChoices name = property(u"Name"_qs, u"String"_qs);
  NewProcChoices taxa = property(u"Juros"_qs, u"Double"_qs);
  EXPECT_EQ(CheckNamesFree(*sales, sub)->message, common::LoadResString(5117));
  EXPECT_EQ(CheckNamesFree(*sales, name)->field, Field::Name);
  taxa.memberVariable = u"TAXA"_qs;
  EXPECT_EQ(CheckNamesFree(*sales, taxa)->message, common::LoadResString(5118));

  auto customers = work.open(u"Clientes"_qs);
  NewProcChoices item = property(u"Item"_qs, u"Object"_qs);
  item.get = false;
  item.let = false;
  item.set = true;
  EXPECT_FALSE(CheckNamesFree(*customers, item));  // the Set the property lacks
  item.get = true;
  EXPECT_EQ(CheckNamesFree(*customers, item)->field, Field::Name);

  NewProcChoices imprimir{u"Imprimir"_qs, ProcType::Sub};
  imprimir.isDefault = true;
  WriteProcedures(*work.vbe, customers->CodePane(), imprimir, {}, work.insertion);
  work.reopened();
  const QString text = work.file(u"Clientes.cls"_qs);
  EXPECT_TRUE(text.contains(u"Attribute Item.VB_UserMemId = 2\r\n"_qs)) << text.toStdString();
  EXPECT_TRUE(text.contains(u"Attribute Count.VB_UserMemId = 1\r\n"_qs));
  EXPECT_TRUE(text.contains(u"Private Sub Imprimir()\r\nAttribute Imprimir.VB_UserMemId = 0\r\n"_qs));
}

}  // namespace
}  // namespace newproc::test
