// SPDX-License-Identifier: MIT
#include "textins/frmcopybuf.h"

#include "common/errors.h"
#include "common/strings.h"
#include "textins/texts.h"

namespace textins {

frmCopyBuf::frmCopyBuf(CCopyBuffers& owner, ide::UserInterface& ui, HelpOpener help, QWidget* parent)
    : TextsWindow(ui, std::move(help),
                  Layout{5000, 5001, 5002, 5090, common::title(), 5, "lstBuffers", "txtBuffer", "Tb"},
                  parent),
      m_owner(owner) {
  setObjectName(QStringLiteral("frmCopyBuf"));
}

void frmCopyBuf::InitWindow() {
  m_working = m_owner.CopyCol();
  std::vector<TextEntry> entries;
  for (CBuffer& buffer : m_working)
    entries.push_back(
        {buffer.IdBuffer, buffer.HotKeyPaste.Id, &buffer.Text, &buffer.Enabled, &buffer.Changed});
  fill(std::move(entries));
}

void frmCopyBuf::reportFailure() {
  common::logLastError();
  ui().MsgBox(common::LoadResString(kUndeterminedError), ide::mb::Exclamation, common::title());
}

void showCopyBuffersWindow(CCopyBuffers& buffers, ide::UserInterface& ui, const HelpOpener& help) {
  execTextsWindow(ui, kCopyBuffersLoadFailed, [&](QWidget* parent) {
    auto window = std::make_unique<frmCopyBuf>(buffers, ui, help, parent);
    window->InitWindow();
    return window;
  });
}

}  // namespace textins
