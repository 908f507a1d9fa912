// SPDX-License-Identifier: MIT
// The macro editor: the 41 hotkeys with their check marks beside the text of the selected one, and a
// menu of the reserved words (placeholders and cursor markers) to put into the text.
#pragma once

#include "textins/macros.h"
#include "textins/textswindow.h"

class QToolButton;

namespace textins {

class frmMacros final : public TextsWindow {
  Q_OBJECT

 public:
  frmMacros(CMacros& owner, ide::UserInterface& ui, HelpOpener help, QWidget* parent = nullptr);

  /// Takes a working copy of the owner's macros and shows it.
  void InitWindow();
  /// The "Palavras Reservadas" drop-down button of tb2.
  QToolButton* resWords() const { return m_resWords; }
  const std::vector<CHotKey>& workingSet() const { return m_working; }

 protected:
  void saveWorkingSet() override { m_owner.SaveEdits(m_working); }
  void reportFailure() override;
  void textBoxFocusChanged(bool focused) override;

 private:
  CMacros& m_owner;
  std::vector<CHotKey> m_working;
  QToolButton* m_resWords;
};

/// Opens the macro editor over `parent` (the IDE's window when null), modally, as CMacros::Show() does.
/// A failure while it loads shows "Erro na carga do formulário de macros.".
void showMacrosWindow(CMacros& macros, ide::UserInterface& ui, const HelpOpener& help);

}  // namespace textins
