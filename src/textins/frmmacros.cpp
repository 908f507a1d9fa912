// SPDX-License-Identifier: MIT
#include "textins/frmmacros.h"

#include "common/errors.h"
#include "common/strings.h"
#include "textins/texts.h"

#include <QMenu>
#include <QPlainTextEdit>
#include <QToolBar>
#include <QToolButton>

namespace textins {
namespace {
constexpr int kReservedWordsHelp = 16;

struct ReservedWord {
  const char* key;  // empty: a separator
  int caption;
  const char* token;
};

constexpr ReservedWord kReservedWords[] = {
    {"PrjName", 5138, "{ProjectName}"},
    {"ModName", 5139, "{ModuleName}"},
    {"ProcName", 5140, "{ProcedureName}"},
    {"ProcType", 5141, "{ProcedureType}"},
    {"CtrlName", 5142, "{ControlName}"},
    {"", 0, nullptr},
    {"SelStart", 5145, "{SS}"},
    {"SelEnd", 5146, "{SE}"},
    {"CurPos", 5147, "{C}"},
    {"", 0, nullptr},
    {"CpName", 5143, "{ComputerName}"},
    {"UsrName", 5144, "{UserName}"},
    {"", 0, nullptr},
    {"Date", 5148, "{Date}"},
    {"Time", 5149, "{Time}"},
    {"", 0, nullptr},
    {"Help", 5150, nullptr},
};

}  // namespace

frmMacros::frmMacros(CMacros& owner, ide::UserInterface& ui, HelpOpener help, QWidget* parent)
    : TextsWindow(ui, std::move(help),
                  Layout{5037, 5039, 5040, 5086, common::title() + QStringLiteral(" - Macros"), 4,
                         "lstMacros", "txtTexto", "tb1"},
                  parent),
      m_owner(owner),
      m_resWords(new QToolButton(this)) {
  setObjectName(QStringLiteral("frmMacros"));
  QToolBar* tb2 = addToolBarBeside("tb2");
  m_resWords->setObjectName(QStringLiteral("ResWords"));
  m_resWords->setText(common::LoadResString(kReservedWordsButton));
  m_resWords->setPopupMode(QToolButton::InstantPopup);
  m_resWords->setToolButtonStyle(Qt::ToolButtonTextOnly);
  // A click must leave the focus (and so the caret) in the text box.
  m_resWords->setFocusPolicy(Qt::NoFocus);
  auto* menu = new QMenu(m_resWords);
  for (const ReservedWord& word : kReservedWords) {
    if (!*word.key) {
      menu->addSeparator();
      continue;
    }
    QAction* item = menu->addAction(common::LoadResString(word.caption));
    item->setObjectName(QLatin1StringView(word.key));
    if (word.token)
      connect(item, &QAction::triggered, this,
              [this, token = QLatin1StringView(word.token)] { insertAtCaret(token); });
    else
      connect(item, &QAction::triggered, this, [this] { openHelp(kReservedWordsHelp); });
  }
  m_resWords->setMenu(menu);
  tb2->addWidget(m_resWords);
  m_resWords->setEnabled(false);
}

void frmMacros::InitWindow() {
  m_working = m_owner.CopyCol();
  std::vector<TextEntry> entries;
  for (CHotKey& hk : m_working)
    entries.push_back({hk.StrId, hk.Id, &hk.Text, &hk.Enabled, &hk.Changed});
  fill(std::move(entries));
}

void frmMacros::reportFailure() {
  common::ShowErrorReport(ui());
}

void frmMacros::textBoxFocusChanged(bool focused) {
  m_resWords->setEnabled(focused);
}

void showMacrosWindow(CMacros& macros, ide::UserInterface& ui, const HelpOpener& help) {
  execTextsWindow(ui, kMacrosLoadFailed, [&](QWidget* parent) {
    auto window = std::make_unique<frmMacros>(macros, ui, help, parent);
    window->InitWindow();
    return window;
  });
}

}  // namespace textins
