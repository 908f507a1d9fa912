// SPDX-License-Identifier: MIT
// The keyboard macros and the copy buffers through the add-in in the IDE model: keys pressed in a code
// window insert text, copy and paste; without the database their commands say why and no key is taken.
#include "addinfixture.h"
#include "appdata/appinfofile.h"
#include "common/strings.h"
#include "host/model/objects.h"

#include <gtest/gtest.h>

#include <QFile>

#include <array>

namespace addin::test {
namespace {

constexpr unsigned kCtrl = ide::mod::Control;
constexpr unsigned kShift = ide::mod::Shift;
constexpr unsigned kAlt = ide::mod::Alt;

/// The real add-in with its real features, connected after the IDE's start-up to two modules.
struct Session {
  explicit Session(const std::function<void(const QString& installDir)>& prepare) {
    prepare(environment.installDir());
    auto project = vbe->newProject();
    one = addModule(project, u"modUm"_qs, 2, 5);
    two = addModule(project, u"modDois"_qs, 1, 5);
    QVariantList custom;
    connection.OnConnection(vbe, ide::ConnectMode::AfterStartup, addIn, custom);
  }
  ~Session() {
    QVariantList custom;
    connection.OnDisconnection(ide::DisconnectMode::UserClosed, custom);
  }
  /// The module's code window in front with the focus, once the timer has put the hotkeys on it.
  ide::HWnd focus(const std::shared_ptr<host::ComponentImpl>& module) {
    auto pane = showAt(module, 1);
    vbe->manualLoop()->advance(100);
    return pane->Window()->hWnd();
  }
  bool press(ide::HWnd window, unsigned modifiers, char key) {
    return vbe->windowSystem().deliverHotKey(window, modifiers, unsigned(key));
  }
  void select(int l1, int c1, int l2, int c2) { vbe->ActiveCodePane()->SetSelection(l1, c1, l2, c2); }
  std::array<int, 4> selection() {
    std::array<int, 4> s{};
    vbe->ActiveCodePane()->GetSelection(s[0], s[1], s[2], s[3]);
    return s;
  }
  QStringList lines(const std::shared_ptr<host::ComponentImpl>& module, int from, int count) {
    return module->CodeModule()->Lines(from, count).split(u"\r\n"_qs);
  }

  AddInEnvironment environment;
  std::shared_ptr<host::VbeImpl> vbe = host::VbeImpl::create();
  std::shared_ptr<FakeAddIn> addIn = std::make_shared<FakeAddIn>(vbe);
  Connect connection;
  std::shared_ptr<host::ComponentImpl> one;
  std::shared_ptr<host::ComponentImpl> two;
};

TEST(TextFeatures, MacroAndCopyBufferKeysInsertTextInTheCodeWindow) {
  Session ide([](const QString& installDir) {
    appdata::CAppInfoFile db;
    db.OpenFile(installDir);
    db.WriteMacroText(u"Ctrl+Alt+A"_qs, u"If x Then\r\n    {C}\r\nEnd If\r\n"_qs);
    db.WriteMacroText(u"Ctrl+Shift+B"_qs, u"{SS}{ModuleName}{SE}"_qs);
    db.WriteMacroText(u"Ctrl+Alt+D"_qs, u"nunca"_qs);
    db.WriteMacroState(u"Ctrl+Alt+D"_qs, false);
    db.WriteCopyBufferText(u"Ctrl+4"_qs, u"antigo"_qs);
    db.WriteCopyBufferText(u"Ctrl+5"_qs, u"' {ModuleName}"_qs);
    db.WriteCopyBufferText(u"Ctrl+6"_qs, u"desligada"_qs);
    db.WriteCopyBufferState(u"Ctrl+6"_qs, false);
  });
  appdata::CAppInfoFile stored;  // what another IDE would read
  stored.OpenFile(ide.environment.installDir());

  const ide::HWnd first = ide.focus(ide.one);
  ide.select(10, 9, 10, 10);
  EXPECT_TRUE(ide.press(first, kCtrl | kShift, 'B'));
  EXPECT_EQ(ide.lines(ide.one, 10, 1), QStringList{u"    m = modUm + 1"_qs});
  EXPECT_EQ(ide.selection(), (std::array{10, 9, 10, 14}));

  ide.select(4, 1, 4, 1);
  EXPECT_TRUE(ide.press(first, kCtrl | kAlt, 'A'));
  EXPECT_EQ(ide.lines(ide.one, 4, 4),
            (QStringList{u"If x Then"_qs, u"    "_qs, u"End If"_qs, u"    m = m + 0"_qs}));
  EXPECT_EQ(ide.selection(), (std::array{5, 5, 5, 5}));

  EXPECT_FALSE(ide.press(first, kCtrl | kAlt, 'D')) << "a disabled macro's key goes to the editor";
  EXPECT_FALSE(ide.press(first, kCtrl, '6')) << "so do both keys of a disabled buffer";
  EXPECT_FALSE(ide.press(first, kCtrl | kShift, '6'));

  // Two lines copied into buffer 3 are stored at once; nothing selected empties buffer 4.
  ide.select(4, 1, 6, 1);
  EXPECT_TRUE(ide.press(first, kCtrl | kShift, '3'));
  EXPECT_EQ(stored.GetCopyBufferText(u"Ctrl+3"_qs), u"If x Then\r\n    \r\n"_qs);
  ide.select(1, 1, 1, 1);
  EXPECT_TRUE(ide.press(first, kCtrl | kShift, '4'));
  EXPECT_EQ(stored.GetCopyBufferText(u"Ctrl+4"_qs), QString());

  const ide::HWnd second = ide.focus(ide.two);
  EXPECT_EQ(ide.vbe->windowSystem().hotKeyCount(first), 0);
  ide.select(4, 1, 4, 1);
  EXPECT_TRUE(ide.press(second, kCtrl, '3'));
  EXPECT_EQ(ide.lines(ide.two, 3, 4),
            (QStringList{u"Public Sub Proc1()"_qs, u"If x Then"_qs, u"    "_qs, u"    m = m + 0"_qs}));
  ide.select(1, 16, 1, 16);
  EXPECT_TRUE(ide.press(second, kCtrl, '5'));
  EXPECT_EQ(ide.lines(ide.two, 1, 1), QStringList{u"Option Explicit' modDois"_qs});
  EXPECT_TRUE(ide.vbe->headlessUi()->messageBoxes().empty());
}

TEST(TextFeatures, WithoutTheDatabaseTheCommandsSayWhyAndNoKeyIsTaken) {
  Session ide([](const QString& installDir) {
    QFile file(installDir + u"/Quimbel.inf"_qs);
    ASSERT_TRUE(file.open(QIODevice::WriteOnly));
    file.write("Attribute VB_Name = \"Quimbel\"\r\n");
  });
  const ide::HWnd window = ide.focus(ide.one);
  EXPECT_EQ(ide.vbe->windowSystem().hotKeyCount(window), 0);
  for (const int command : {4, 5}) {
    auto bar = ide.vbe->CommandBars()->Item(u"Quimbel 2.2"_qs)->Controls();
    for (int i = 1; i <= bar->Count(); ++i)
      if (bar->Item(i)->TooltipText() == common::LoadResString(command)) bar->Item(i)->Execute();
  }
  const auto& boxes = ide.vbe->headlessUi()->messageBoxes();
  ASSERT_EQ(boxes.size(), 3u) << "the start-up's, then one per command";
  const QString why = ide.connection.globals()->AppInfoUnavailable();
  EXPECT_TRUE(why.contains(u"Quimbel.inf"_qs));
  for (const auto& box : boxes)
    EXPECT_EQ(box.prompt, why);
}

}  // namespace
}  // namespace addin::test
