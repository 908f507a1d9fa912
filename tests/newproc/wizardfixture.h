// SPDX-License-Identifier: MIT
// A saved VB6 project for the wizard's tests (a standard module of sales code ending in blank lines and a
// collection class, Windows-1252 files with CR LF line ends, named in another letter case than the project
// says) in a headless IDE, with a text insertion of fixed user, locale and clock and the wizard's services.
#pragma once

#include "appdata/appinfofile.h"
#include "host/model/objects.h"
#include "host/model/vbe.h"
#include "host/platform/headlessui.h"
#include "newproc/frmnewproc.h"
#include "testproject.h"
#include "textins/textinsertion.h"

#include <QStringDecoder>
#include <QStringEncoder>
#include <QStringList>
#include <QTemporaryDir>

namespace newproc::test {

struct Workspace {
  QTemporaryDir dir;
  std::shared_ptr<host::VbeImpl> vbe = host::VbeImpl::create(), fresh;
  common::SettingsStore settings{dir.filePath(QStringLiteral("Quimbel.ini"))};
  appdata::CAppInfoFile appInfo;
  int lastWindowType = 0;
  bool running = false;
  int helpShown = 0;
  textins::TextInsertion insertion{
      *vbe,
      {QStringLiteral("PC-01"), QStringLiteral("ana"), [this] { return lastWindowType; },
       QLocale(QLocale::Portuguese, QLocale::Brazil),
       [] { return QDateTime(QDate(2024, 3, 7), QTime(14, 5, 9)); }}};

  Workspace() {
    auto cp1252 = QStringEncoder("Windows-1252");
    host::test::writeBytes(
        dir.filePath(QStringLiteral("VENDAS.BAS")),
        cp1252(QStringLiteral(
            "Attribute VB_Name = \"modVendas\"\r\nOption Explicit\r\n' Módulo de vendas: preços em R$\r\n"
            "Private Const TAXA As Double = 0.1\r\nPublic Name As String\r\n\r\n"
            "Public Function Total(ByVal Valor As Currency) As Currency\r\n10      Total = Valor * (1 + "
            "TAXA)\r\n"
            "20      If Total < 0 Then GoTo 40\r\n30      Exit Function\r\n40      Total = 0\r\nEnd "
            "Function\r\n\r\n\r\n")));
    host::test::writeBytes(
        dir.filePath(QStringLiteral("Clientes.cls")),
        "VERSION 1.0 CLASS\r\nBEGIN\r\n  MultiUse = -1  'True\r\nEND\r\nAttribute VB_Name = \"Clientes\"\r\n"
        "Attribute VB_Exposed = False\r\nOption Explicit\r\nPrivate mCol As Collection\r\n\r\n"
        "Public Property Get Item(ByVal Index As Variant) As Object\r\nAttribute Item.VB_UserMemId = 0\r\n"
        "    Set Item = mCol(Index)\r\nEnd Property\r\n\r\nPublic Function Count() As Long\r\n"
        "Attribute Count.VB_UserMemId = 1\r\n    Count = mCol.Count\r\nEnd Function\r\n");
    host::test::writeBytes(
        dir.filePath(QStringLiteral("Loja.vbp")),
        "Type=Exe\r\nModule=modVendas; vendas.bas\r\nClass=Clientes; CLIENTES.CLS\r\nName=\"Loja\"\r\n");
    vbe->setActiveVBProject(vbe->open(dir.filePath(QStringLiteral("Loja.vbp"))).front());
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
    return fresh->open(dir.filePath(QStringLiteral("Loja.vbp")))
        .front()
        ->VBComponents()
        ->Item(component)
        ->CodeModule();
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
inline QString linesFrom(ide::CodeModule& module, int from) {
  return module.Lines(from, module.CountOfLines() - from + 1)
      .replace(QStringLiteral("\r\n"), QStringLiteral("|"));
}

}  // namespace newproc::test
