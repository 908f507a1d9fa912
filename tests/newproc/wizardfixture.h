// SPDX-License-Identifier: MIT
// A saved VB6 project for the wizard's tests: a standard module of sales code and a collection class,
// written as Windows-1252 files with CR LF line ends, opened in a headless IDE with a text insertion of
// fixed user, locale and clock. `reopened()` loads what was saved into a fresh IDE.
#pragma once

#include "host/model/objects.h"
#include "host/model/vbe.h"
#include "testproject.h"
#include "textins/textinsertion.h"

#include <QStringDecoder>
#include <QStringEncoder>
#include <QStringList>
#include <QTemporaryDir>

namespace newproc::test {

// Ends with blank lines, which the IDE gives to the procedure written after them.
inline const QString kSalesModule = QStringLiteral(
    "Attribute VB_Name = \"modVendas\"\r\nOption Explicit\r\n' Módulo de vendas: preços em R$\r\n"
    "Private Const TAXA As Double = 0.1\r\nPublic Name As String\r\n\r\n"
    "Public Function Total(ByVal Valor As Currency) As Currency\r\n10      Total = Valor * (1 + TAXA)\r\n"
    "20      If Total < 0 Then GoTo 40\r\n30      Exit Function\r\n40      Total = 0\r\nEnd Function\r\n"
    "\r\n\r\n");
inline const QString kCustomersClass = QStringLiteral(
    "VERSION 1.0 CLASS\r\nBEGIN\r\n  MultiUse = -1  'True\r\nEND\r\nAttribute VB_Name = \"Clientes\"\r\n"
    "Attribute VB_GlobalNameSpace = False\r\nAttribute VB_Creatable = True\r\n"
    "Attribute VB_PredeclaredId = False\r\nAttribute VB_Exposed = False\r\nOption Explicit\r\n"
    "Private mCol As Collection\r\n\r\nPublic Property Get Item(ByVal Index As Variant) As Object\r\n"
    "Attribute Item.VB_UserMemId = 0\r\n    Set Item = mCol(Index)\r\nEnd Property\r\n\r\n"
    "Public Function Count() As Long\r\nAttribute Count.VB_UserMemId = 1\r\n    Count = mCol.Count\r\n"
    "End Function\r\n");

struct Workspace {
  QTemporaryDir dir;
  std::shared_ptr<host::VbeImpl> vbe = host::VbeImpl::create();
  std::shared_ptr<host::ProjectImpl> project;
  int lastWindowType = 0;
  textins::TextInsertion insertion{
      *vbe,
      {QStringLiteral("PC-01"), QStringLiteral("ana"), [this] { return lastWindowType; },
       QLocale(QLocale::Portuguese, QLocale::Brazil),
       [] { return QDateTime(QDate(2024, 3, 7), QTime(14, 5, 9)); }}};

  Workspace() {
    auto cp1252 = QStringEncoder("Windows-1252");
    host::test::writeBytes(dir.filePath(QStringLiteral("VENDAS.BAS")), cp1252(kSalesModule));
    host::test::writeBytes(dir.filePath(QStringLiteral("Clientes.cls")), cp1252(kCustomersClass));
    host::test::writeBytes(dir.filePath(QStringLiteral("Loja.vbp")),
                           "Type=Exe\r\nModule=modVendas; vendas.bas\r\nClass=Clientes; CLIENTES.CLS\r\n"
                           "Name=\"Loja\"\r\n");
    project = vbe->open(dir.filePath(QStringLiteral("Loja.vbp"))).front();
    vbe->setActiveVBProject(project);
  }

  /// The component's code window, opened, active and selected.
  ide::Ref<ide::CodeModule> open(const QString& component) {
    auto found = std::dynamic_pointer_cast<host::ComponentImpl>(project->VBComponents()->Item(component));
    found->CodeModule()->CodePane()->Show();
    vbe->selectComponent(found);
    return found->CodeModule();
  }

  /// The project as saved, in a fresh IDE.
  std::shared_ptr<host::ProjectImpl> reopened() {
    vbe->saveAll();
    fresh = host::VbeImpl::create();
    return fresh->open(dir.filePath(QStringLiteral("Loja.vbp"))).front();
  }
  std::shared_ptr<host::VbeImpl> fresh;

  /// A file of the project as text.
  QString file(const QString& name) const {
    auto decode = QStringDecoder("Windows-1252");
    return decode(host::test::readBytes(dir.filePath(name)));
  }
};

/// The lines of a module from `from` on.
inline QStringList linesFrom(ide::CodeModule& module, int from) {
  QStringList lines;
  for (int i = from; i <= module.CountOfLines(); ++i)
    lines << module.Lines(i, 1);
  return lines;
}

}  // namespace newproc::test
