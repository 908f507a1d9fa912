// SPDX-License-Identifier: MIT
#include "find/navigate.h"

#include "common/errors.h"
#include "common/strings.h"
#include "find/texts.h"

namespace find {
namespace {

bool isOpen(ide::VBE& vbe, const ide::Ref<ide::VBProject>& project) {
  if (!project) return false;
  for (const auto& open : vbe.VBProjects()->items())
    if (open == project) return true;
  return false;
}

}  // namespace

int TopLineFor(int startLine, int visibleLines) {
  const int top = startLine - visibleLines / 2;
  return top >= 1 ? top : startLine;
}

void ShowItemFound(ide::VBE& vbe, const CItemFound& item, const std::function<void()>& beforeShow) {
  ide::UserInterface& ui = vbe.Platform().ui();
  if (!isOpen(vbe, item.Project)) {
    ui.MsgBox(common::LoadResString(kProjectGone), ide::mb::Information, common::title());
    return;
  }
  ide::Ref<ide::CodePane> pane;
  try {
    if (item.Component)
      if (auto module = item.Component->CodeModule()) pane = module->CodePane();
  } catch (const std::exception& failure) {
    common::logFailure(failure, QStringLiteral("navigate"), QStringLiteral("ShowItemFound"),
                       __LINE__);  // told below
  }
  if (!pane) {
    QString name;
    try {
      if (item.Component) name = item.Component->Name();
    } catch (const std::exception& failure) {
      common::logFailure(failure, QStringLiteral("navigate"), QStringLiteral("ShowItemFound"),
                         __LINE__);  // told without it
    }
    ui.MsgBox(common::LoadResString(kNoCodeWindow) + QStringLiteral(" \"") + name + QStringLiteral("\" ") +
                  common::LoadResString(kInActiveProject),
              ide::mb::Information, common::title());
    return;
  }
  if (beforeShow) beforeShow();
  pane->Show();
  pane->setTopLine(TopLineFor(item.startline, pane->CountOfVisibleLines()));
  pane->SetSelection(item.startline, item.startcol, item.endline, item.endcol);
}

}  // namespace find
