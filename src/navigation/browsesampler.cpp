// SPDX-License-Identifier: MIT
#include "navigation/browsesampler.h"

#include <algorithm>

namespace navigation {

void BrowseSampler::tick(ide::VBE& vbe, const ide::Ref<ide::Window>& activeWindow, bool hotKeyProcInstalled) {
  if (m_sampleTime != kSampleEveryMs) {
    m_sampleTime += kTickMs;
    m_dwellTime += kTickMs;
    return;
  }
  // The history's own moves are not visits.
  if (!m_histories.busy()) {
    if (!activeWindow) {
      if (hotKeyProcInstalled) m_dwellTime += kTickMs;
    } else if (activeWindow->Type() == ide::WindowType::CodeWindow) {
      if (auto pane = vbe.ActiveCodePane()) sample(pane);
    }
  }
  m_sampleTime = 0;
  // Kept above the visit threshold, so that a very long stay still counts as a visit.
  if (m_dwellTime > 2'000'000'000) m_dwellTime = kVisitedAfterMs + kTickMs;
}

void BrowseSampler::sample(const ide::Ref<ide::CodePane>& pane) {
  const int topLine = pane->TopLine();
  auto module = pane->CodeModule();
  // The middle visible line, but never past the module's end: a short module shown in a tall pane is
  // still inside its last procedure.
  const int middle = std::min(topLine + pane->CountOfVisibleLines() / 2, module->CountOfLines());
  ide::ProcKind kind = ide::ProcKind::Proc;
  const QString procName = middle >= 1 ? module->ProcOfLine(middle, kind) : QString();

  HISTORY_ENTRY& current = m_histories.CurrentPosition();
  pane->GetSelection(current.StartLine, current.StartColumn, current.EndLine, current.EndColumn);

  auto takePlace = [&] {
    current.TopLine = topLine;
    current.ProcName = procName;
    current.ProcKind = kind;
    current.CodeModule = module;
  };
  if (!current.CodeModule) {
    takePlace();
    m_dwellTime = kTickMs;
  } else if (current.CodeModule == module && current.ProcName == procName && current.ProcKind == kind) {
    current.TopLine = topLine;
    m_dwellTime += kTickMs;
  } else {
    if (m_histories.CurrentHistoryIndex() == 0 && m_dwellTime > kVisitedAfterMs) m_histories.AddHistory();
    if (m_histories.CurrentHistoryIndex() != 0) m_histories.ClearHistories(CA_FORWARD);
    takePlace();
    m_dwellTime = 0;
  }
}

}  // namespace navigation
