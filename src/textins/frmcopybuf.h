// SPDX-License-Identifier: MIT
// The copy-buffer window: the ten buffers (by their paste key) with their check marks beside the content
// of the selected one.
#pragma once

#include "textins/copybuffers.h"
#include "textins/textswindow.h"

namespace textins {

class frmCopyBuf final : public TextsWindow {
  Q_OBJECT

 public:
  frmCopyBuf(CCopyBuffers& owner, ide::UserInterface& ui, HelpOpener help, QWidget* parent = nullptr);

  /// Takes a working copy of the owner's buffers and shows it.
  void InitWindow();
  const std::vector<CBuffer>& workingSet() const { return m_working; }

 protected:
  void saveWorkingSet() override { m_owner.SaveEdits(m_working); }
  /// "Erro indeterminado." (the log keeps what failed).
  void reportFailure() override;

 private:
  CCopyBuffers& m_owner;
  std::vector<CBuffer> m_working;
};

/// Opens the window over the IDE's window, modally, as CCopyBuffers::Show() does. A failure while it loads
/// shows "Erro na carga do formulário das memórias de cópia.".
void showCopyBuffersWindow(CCopyBuffers& buffers, ide::UserInterface& ui, const HelpOpener& help);

}  // namespace textins
