// SPDX-License-Identifier: MIT
#include "addin/texttools.h"

#include "addin/help.h"
#include "common/errors.h"
#include "common/strings.h"
#include "textins/frmcopybuf.h"
#include "textins/frmmacros.h"

namespace addin {

TextTools::TextTools(const FeatureServices& services)
    : m_vbe(services.vbe),
      m_ui(services.vbe->Platform().ui()),
      m_unavailable(services.appInfoUnavailable),
      m_envUtils(*services.vbe) {
  if (!services.appInfo) return;
  ide::WindowSystem& windows = m_vbe->Platform().windows();
  auto findActiveCodeWindow = [vbe = m_vbe.get(), model = services.startDisplayModel] {
    return FindActiveCodeWindow(*vbe, model);
  };
  textins::HelpOpener help = [&ui = m_ui, dir = services.installDir](int context) {
    return showHelpTopic(ui, dir, context);
  };
  m_copyBuffers.emplace(
      windows, *services.appInfo, services.textInsertion, [this] { return m_envUtils.GetSelectedText(); },
      findActiveCodeWindow);
  m_copyBuffers->setEditor([&ui = m_ui, help](textins::CCopyBuffers& buffers) {
    textins::showCopyBuffersWindow(buffers, ui, help);
  });
  m_macros.emplace(windows, *services.appInfo, services.textInsertion, findActiveCodeWindow);
  m_macros->setEditor(
      [&ui = m_ui, help](textins::CMacros& macros) { textins::showMacrosWindow(macros, ui, help); });
}

TextTools::~TextTools() {
  m_copyBuffers.reset();
  m_macros.reset();
}

bool TextTools::available() {
  if (m_macros && m_copyBuffers) return true;
  m_ui.MsgBox(m_unavailable, ide::mb::Exclamation, common::title());
  return false;
}

void TextTools::command(const char* procedure, const std::function<void()>& show) {
  if (!available()) return;
  try {
    show();
  } catch (const std::exception& failure) {
    common::recordError(failure, QStringLiteral("CVBEvents"), QLatin1StringView(procedure), __LINE__);
    common::ShowErrorReport(m_ui);
  }
}

void TextTools::showMacros() {
  command("EvButtonMacros_Click", [this] { m_macros->Show(); });
}

void TextTools::showCopyBuffers() {
  command("EvButtonCopyBuffers_Click", [this] { m_copyBuffers->Show(); });
}

}  // namespace addin
