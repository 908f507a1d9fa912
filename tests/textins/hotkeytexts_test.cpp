// SPDX-License-Identifier: MIT
// The keyboard macros and the copy buffers over the IDE model and a real database: the sets and their
// atoms, what Save() registers and writes, and the two windows offscreen.
#include "appdata/appinfofile.h"
#include "common/strings.h"
#include "host/model/objects.h"
#include "host/model/vbe.h"
#include "host/platform/headlessui.h"
#include "printers.h"
#include "textins/frmcopybuf.h"
#include "textins/frmmacros.h"

#include <gtest/gtest.h>

#include <QAction>
#include <QApplication>
#include <QClipboard>
#include <QFileInfo>
#include <QLabel>
#include <QListWidget>
#include <QMenu>
#include <QPlainTextEdit>
#include <QSet>
#include <QTemporaryDir>
#include <QTest>
#include <QToolButton>

#include <optional>

namespace textins::test {
namespace {

constexpr unsigned kCtrlAlt = ide::mod::Control | ide::mod::Alt;

/// An IDE with one module in its code window, and the macros and copy buffers over the database in `dir`.
struct Scene {
  explicit Scene(const QString& dir) {
    db.OpenFile(dir);
    auto module = vbe->newProject()->Add(ide::ComponentType::StdModule);
    module->CodeModule()->AddFromString(u"Sub Main()\r\n\r\nEnd Sub"_qs);
    module->CodeModule()->CodePane()->Show();
    window = module->CodeModule()->CodePane()->Window()->hWnd();
    macros.emplace(windows(), db, insertion, [this] { return window; });
    buffers.emplace(
        windows(), db, insertion, [] { return QString(); }, [this] { return window; });
  }
  host::WindowSystemImpl& windows() { return vbe->windowSystem(); }
  /// What the last commits appended to the database's log (nothing written: unchanged).
  qint64 logSize() const { return QFileInfo(db.FilePath() + u"-wal"_qs).size(); }
  CHotKey& macro(const QString& name, std::vector<CHotKey>& set) {
    return *std::find_if(set.begin(), set.end(), [&](const CHotKey& hk) { return hk.StrId == name; });
  }

  std::shared_ptr<host::VbeImpl> vbe = host::VbeImpl::create();
  appdata::CAppInfoFile db;
  TextInsertion insertion{*vbe, InsertionContext{u"PC"_qs, u"ana"_qs, [] { return 0; }}};
  ide::HWnd window = 0;
  std::optional<CMacros> macros;
  std::optional<CCopyBuffers> buffers;
};

TEST(HotKeySets, FortyOneMacrosAndTwentyBufferKeysInOrderEachWithAnAtomOfItsOwn) {
  QTemporaryDir dir;
  std::optional<Scene> scene(std::in_place, dir.path());
  QStringList names, expected;
  QSet<int> ids;
  for (const CHotKey& hk : scene->macros->Macros()) {
    names << hk.StrId;
    ids << hk.Id;
    EXPECT_EQ(hk.VirtualKey, hk.StrId.back().unicode()) << hk.StrId.toStdString();
    EXPECT_EQ(hk.Modifiers, hk.StrId.startsWith(u"Ctrl+Alt+"_qs) ? 3 : 6) << hk.StrId.toStdString();
    EXPECT_TRUE(hk.Enabled) << "a new row is enabled from the first read on";
  }
  for (const QChar letter : u"ABDEFGHKLMNOPQRSTUWYZ"_qs)
    expected << u"Ctrl+Alt+"_qs + letter;
  for (const QChar letter : u"ABDEGHKLMNOPQRSTUWYZ"_qs)
    expected << u"Ctrl+Shift+"_qs + letter;
  EXPECT_EQ(names, expected);
  names.clear();
  for (const CHotKey* hk : scene->buffers->HotKeys()) {
    names << u"%1 %2 %3"_qs.arg(hk->StrId).arg(hk->Modifiers).arg(hk->Operation);
    ids << hk->Id;
  }
  EXPECT_EQ(names.first(), u"CtrlShift0 6 1"_qs);
  EXPECT_EQ(names[9], u"CtrlShift9 6 1"_qs);
  EXPECT_EQ(names.last(), u"Ctrl9 2 0"_qs);
  EXPECT_EQ(ids.size(), 61);
  EXPECT_FALSE(ids.contains(0));

  auto vbe = scene->vbe;
  scene.reset();
  for (const int id : ids)
    EXPECT_EQ(vbe->windowSystem().GlobalDeleteAtom(quint16(id)), quint16(id)) << "deleted with its owner";
}

TEST(HotKeySets, SaveRegistersWhatWasSwitchedOnAndWritesOnlyWhatChanged) {
  QTemporaryDir dir;
  Scene scene(dir.path());
  for (const char* name : {"Ctrl+Alt+A", "Ctrl+Alt+D"})
    scene.db.WriteMacroState(QLatin1StringView(name), false);
  scene.macros->InitializeFromFile();
  scene.macros->RegisterEnabledHotKeys(scene.window);
  EXPECT_FALSE(scene.windows().hasHotKey(scene.window, kCtrlAlt, 'A'))
      << "switched off: the key stays the IDE's";
  EXPECT_TRUE(scene.windows().hasHotKey(scene.window, kCtrlAlt, 'B'));

  // Ctrl+Alt+B switched off and on again writes nothing.
  std::vector<CHotKey> working = scene.macros->CopyCol();
  scene.macro(u"Ctrl+Alt+B"_qs, working).Changed ^= HK_CHANGE_STATE;
  scene.macro(u"Ctrl+Alt+B"_qs, working).Changed ^= HK_CHANGE_STATE;
  const qint64 before = scene.logSize();
  scene.macros->SaveEdits(working);
  EXPECT_EQ(scene.logSize(), before);

  // Ctrl+Alt+A on, Ctrl+Alt+B off, a text for the disabled Ctrl+Alt+D.
  CHotKey& a = scene.macro(u"Ctrl+Alt+A"_qs, working);
  a.Enabled = true;
  a.Changed = HK_CHANGE_STATE;
  CHotKey& b = scene.macro(u"Ctrl+Alt+B"_qs, working);
  b.Enabled = false;
  b.Changed = HK_CHANGE_STATE;
  CHotKey& d = scene.macro(u"Ctrl+Alt+D"_qs, working);
  d.Text = u"' {ModuleName}"_qs;
  d.Changed = HK_CHANGE_TEXT;
  // While the editor had the focus the keys came off the code window; the working copy does not know.
  scene.macros->UnregisterEnabledHotKeys(scene.window);
  scene.macros->SaveEdits(working);
  EXPECT_TRUE(scene.windows().hasHotKey(scene.window, kCtrlAlt, 'A')) << "registered at once";
  scene.macros->RegisterEnabledHotKeys(scene.window);
  EXPECT_TRUE(scene.windows().hasHotKey(scene.window, kCtrlAlt, 'E')) << "back on with the focus";
  EXPECT_FALSE(scene.windows().hasHotKey(scene.window, kCtrlAlt, 'B'));
  EXPECT_FALSE(scene.windows().hasHotKey(scene.window, kCtrlAlt, 'D'));
  EXPECT_TRUE(scene.db.GetMacroState(u"Ctrl+Alt+A"_qs));
  EXPECT_FALSE(scene.db.GetMacroState(u"Ctrl+Alt+B"_qs));
  EXPECT_FALSE(scene.db.GetMacroState(u"Ctrl+Alt+D"_qs));
  EXPECT_EQ(scene.db.GetMacroText(u"Ctrl+Alt+D"_qs), u"' {ModuleName}"_qs);

  // Leaving the window takes every key off it, the ones Save() put there included.
  scene.macros->UnregisterEnabledHotKeys(scene.window);
  scene.buffers->UnregEnabledCopyBuffersHotKeys();
  EXPECT_EQ(scene.windows().hotKeyCount(scene.window), 0);
}

// ---------------------------------------------------------------------------------------------------
// The windows

struct Windows : Scene {
  explicit Windows(const QString& dir) : Scene(dir) {}
  host::HeadlessUi& ui() { return *vbe->headlessUi(); }
  QStringList prompts() {
    QStringList shown;
    for (const auto& box : ui().messageBoxes())
      shown << box.title + u": "_qs + box.prompt;
    return shown;
  }
};

QString text(int id) {
  return common::LoadResString(id);
}

TEST(HotKeyWindows, CaptionsListsAndTheReservedWordsMenu) {
  QTemporaryDir dir;
  Windows scene(dir.path());
  frmMacros macros(*scene.macros, scene.ui(), {});
  macros.InitWindow();
  frmCopyBuf buffers(*scene.buffers, scene.ui(), {});
  buffers.InitWindow();
  EXPECT_EQ(macros.windowTitle(), u"Quimbel - Definições de Macros"_qs);
  EXPECT_EQ(buffers.windowTitle(), u"Quimbel - Memórias de Cópia"_qs);
  QStringList labels;
  for (const QWidget* window : {static_cast<QWidget*>(&macros), static_cast<QWidget*>(&buffers)})
    for (const QLabel* label : window->findChildren<QLabel*>())
      labels << label->text();
  EXPECT_EQ(labels, (QStringList{text(5039), text(5040), text(5001), text(5002)}));
  EXPECT_EQ(macros.list()->objectName(), u"lstMacros"_qs);
  EXPECT_EQ(buffers.textBox()->objectName(), u"txtBuffer"_qs);
  ASSERT_EQ(macros.list()->count(), 41);
  EXPECT_EQ(macros.list()->currentItem()->text(), u"Ctrl+Alt+A"_qs);
  EXPECT_EQ(macros.list()->item(40)->checkState(), Qt::Checked);
  ASSERT_EQ(buffers.list()->count(), 10);
  EXPECT_EQ(buffers.list()->item(3)->text(), u"Ctrl+3"_qs);
  EXPECT_FALSE(macros.button(u"Save"_qs)->isEnabled());
  EXPECT_FALSE(macros.button(u"Undo"_qs)->isEnabled());

  QStringList menu;
  for (const QAction* item : macros.resWords()->menu()->actions())
    menu << (item->isSeparator() ? u"-"_qs : item->objectName() + u" "_qs + item->text());
  EXPECT_EQ(macros.resWords()->text(), u"Palavras &Reservadas"_qs);
  EXPECT_EQ(menu,
            (QStringList{
                u"PrjName "_qs + text(5138), u"ModName "_qs + text(5139), u"ProcName "_qs + text(5140),
                u"ProcType "_qs + text(5141), u"CtrlName "_qs + text(5142), u"-"_qs,
                u"SelStart "_qs + text(5145), u"SelEnd "_qs + text(5146), u"CurPos "_qs + text(5147), u"-"_qs,
                u"CpName "_qs + text(5143), u"UsrName "_qs + text(5144), u"-"_qs, u"Date "_qs + text(5148),
                u"Time "_qs + text(5149), u"-"_qs, u"Help Ajuda em \"Palavras Reservadas\""_qs}));
  // No help page: the window says so.
  macros.button(u"Help"_qs)->trigger();
  EXPECT_EQ(scene.prompts(), QStringList{u"Quimbel: "_qs + text(5158)});
}

TEST(HotKeyWindows, ClosingAsksOnlyAfterAChangeAndAFailedSaveKeepsTheWindowOpen) {
  QTemporaryDir dir;
  Windows scene(dir.path());
  {
    frmMacros unchanged(*scene.macros, scene.ui(), {});
    unchanged.InitWindow();
    unchanged.show();
    unchanged.reject();
    EXPECT_TRUE(scene.prompts().isEmpty());
  }
  struct Case {
    int answer;
    bool openDatabase;
    const char16_t* typed;
    const char16_t* stored;
    bool stillOpen;
  } const cases[] = {{ide::mb::No, true, u"não", u"", false},
                     {ide::mb::Yes, true, u"sim", u"sim", false},
                     {ide::mb::Yes, false, u"falha", u"", true}};
  for (const Case& c : cases) {
    scene.ui().clearMessageBoxes();
    frmCopyBuf window(*scene.buffers, scene.ui(), {});
    window.InitWindow();
    window.show();
    window.textBox()->setPlainText(QString::fromUtf16(c.typed));
    if (!c.openDatabase) scene.db.CloseFileInfo();
    scene.ui().queueAnswer(c.answer);
    window.reject();
    ASSERT_FALSE(scene.prompts().isEmpty());
    EXPECT_EQ(scene.prompts().first(), u"Quimbel: "_qs + text(5090));
    EXPECT_EQ(window.isVisible(), c.stillOpen);
    if (!c.openDatabase) {
      EXPECT_EQ(scene.prompts().last(), u"Quimbel: "_qs + text(5091));
      break;
    }
    EXPECT_EQ(scene.db.GetCopyBufferText(u"Ctrl+0"_qs), QString::fromUtf16(c.stored));
  }
}

TEST(HotKeyWindows, TheTextBoxKeysButtonsAndReservedWords) {
  QTemporaryDir dir;
  Windows scene(dir.path());
  frmMacros window(*scene.macros, scene.ui(), {});
  window.InitWindow();
  window.show();
  QApplication::setActiveWindow(&window);
  ASSERT_TRUE(QTest::qWaitForWindowActive(&window));
  QPlainTextEdit* box = window.textBox();
  box->setFocus();
  ASSERT_TRUE(QTest::qWaitFor([&] { return box->hasFocus(); }));
  EXPECT_TRUE(window.resWords()->isEnabled());
  EXPECT_FALSE(window.button(u"Cut"_qs)->isEnabled());

  QTest::keyClicks(box, u"If x Then"_qs);
  // A character the code page cannot hold is refused where it is typed (or pasted), and named.
  box->insertPlainText(u"中"_qs);
  EXPECT_EQ(box->toPlainText(), u"If x Then"_qs);
  EXPECT_EQ(box->textCursor().position(), 9);
  ASSERT_EQ(scene.prompts().size(), 1);
  EXPECT_TRUE(scene.prompts()[0].contains(u"\u201C中\u201D (U+4E2D)"_qs)) << scene.prompts()[0].toStdString();
  scene.ui().clearMessageBoxes();
  QTest::keyClick(box, Qt::Key_Z, Qt::ControlModifier);
  EXPECT_EQ(box->toPlainText(), QString()) << "typing is one edit";
  QTest::keyClick(box, Qt::Key_Z, Qt::ControlModifier);
  EXPECT_EQ(box->toPlainText(), u"If x Then"_qs) << "a second undo swaps back";

  QTextCursor cursor = box->textCursor();
  cursor.setPosition(3);
  cursor.setPosition(4, QTextCursor::KeepAnchor);
  box->setTextCursor(cursor);
  EXPECT_TRUE(window.button(u"Cut"_qs)->isEnabled());
  window.resWords()->menu()->findChild<QAction*>(u"CurPos"_qs)->trigger();
  EXPECT_EQ(box->toPlainText(), u"If {C} Then"_qs);
  EXPECT_TRUE(box->hasFocus());
  box->selectAll();
  QTest::keyClick(box, Qt::Key_Delete, Qt::ShiftModifier);
  EXPECT_EQ(box->toPlainText(), QString());
  EXPECT_EQ(QGuiApplication::clipboard()->text(), u"If {C} Then"_qs) << "Shift+Delete cuts";
  ASSERT_TRUE(window.button(u"Paste"_qs)->isEnabled());
  window.button(u"Paste"_qs)->trigger();

  window.list()->setFocus();
  ASSERT_TRUE(QTest::qWaitFor([&] { return !box->hasFocus(); }));
  for (const char* key : {"Undo", "Cut", "Copy", "Paste", "Delete"})
    EXPECT_FALSE(window.button(QLatin1StringView(key))->isEnabled()) << key;
  EXPECT_FALSE(window.resWords()->isEnabled());

  // Checking twice leaves the macro unchanged; Save then writes nothing for it.
  window.list()->item(1)->setCheckState(Qt::Unchecked);
  window.list()->item(1)->setCheckState(Qt::Checked);
  EXPECT_EQ(window.workingSet()[1].Changed, 0);
  EXPECT_EQ(window.workingSet()[0].Changed, HK_CHANGE_TEXT);
  window.list()->item(2)->setCheckState(Qt::Unchecked);
  window.button(u"Save"_qs)->trigger();
  EXPECT_EQ(scene.db.GetMacroText(u"Ctrl+Alt+A"_qs), u"If {C} Then"_qs);
  EXPECT_FALSE(scene.db.GetMacroState(u"Ctrl+Alt+D"_qs));
  EXPECT_FALSE(window.isChanged());
  // Switched on again after the save: a change of its own.
  window.list()->item(2)->setCheckState(Qt::Checked);
  window.button(u"Save"_qs)->trigger();
  EXPECT_TRUE(scene.db.GetMacroState(u"Ctrl+Alt+D"_qs));
  window.reject();
  EXPECT_TRUE(scene.prompts().isEmpty());
}

}  // namespace
}  // namespace textins::test
