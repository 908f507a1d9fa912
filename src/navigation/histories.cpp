// SPDX-License-Identifier: MIT
#include "navigation/histories.h"

#include "common/errors.h"

#include <algorithm>
#include <utility>

namespace navigation {
namespace {

/// The component that owns `module`, if it is still in the IDE.
ide::Ref<ide::VBComponent> ownerOf(const ide::Ref<ide::CodeModule>& module) {
  if (!module) return nullptr;
  try {
    auto component = module->Parent();
    if (!component) return nullptr;
    component->Collection();  // fails once the component (or its project) has left the IDE
    return component;
  } catch (const std::exception&) {
    return nullptr;
  }
}

}  // namespace

CHistories::CHistories(ide::VBE& vbe, common::CommandState& commandState)
    : m_vbe(vbe), m_state(commandState) {}

void CHistories::ClearHistories(CLEAR_ACTION action) {
  if (action == CA_TOTAL) {
    m_entries = {};
    m_count = 0;
    m_currentIndex = 0;
    setBack(false);
    setForward(false);
    m_current = HISTORY_ENTRY();
    return;
  }
  if (m_currentIndex == 0) return;
  for (int i = m_currentIndex + 1; i <= kCapacity; ++i)
    m_entries[static_cast<size_t>(i - 1)] = HISTORY_ENTRY();
  m_count = m_currentIndex;
  m_currentIndex = 0;
  setBack(m_count != 0);
  setForward(false);
}

void CHistories::AddHistory() {
  if (m_count == kCapacity) {
    std::move(m_entries.begin() + 1, m_entries.end(), m_entries.begin());
    m_entries.back() = HISTORY_ENTRY();
    m_count = kCapacity - 1;
  }
  m_entries[static_cast<size_t>(m_count)] = m_current;
  ++m_count;
  setBack(true);
  setForward(false);
}

void CHistories::Browse(BROWSE_DIR direction) {
  if (m_count == 0) return;
  if (m_currentIndex == 0) {
    if (direction == BD_FORWARD) {
      setForward(false);
      return;
    }
    // The present place becomes the newest one, so that forward can come back to it. A present that was
    // never sampled (or whose module was removed) is no place: going forward to it would wipe the history.
    int target = m_count;
    if (m_current.CodeModule) {
      AddHistory();
      target = m_count - 1;
    }
    target = std::max(target, 0);
    if (target == 0) return;
    if (!take(target)) return;
    m_currentIndex = target;
    setForward(m_currentIndex < m_count);
    setBack(m_currentIndex >= 2);
    return;
  }
  const int i = m_currentIndex;
  if (direction == BD_BACKWARD) {
    if (i <= 1) {
      setBack(false);
      return;
    }
    if (!take(i - 1)) return;
    m_currentIndex = i - 1;
    setForward(true);
    setBack(m_currentIndex >= 2);
    return;
  }
  if (i >= m_count) {
    setForward(false);
    return;
  }
  if (!take(i + 1)) return;
  m_currentIndex = i + 1;
  setBack(true);
  setForward(m_currentIndex < m_count);
}

void CHistories::SetTopLineOfLastHistory(int topLine) {
  if (m_count > 0) m_entries[static_cast<size_t>(m_count - 1)].TopLine = topLine;
}

void CHistories::RemoveHistoriesOfComponent(const ide::Ref<ide::VBComponent>& component) {
  ide::Ref<ide::CodeModule> module;
  try {
    module = component ? component->CodeModule() : nullptr;
  } catch (const std::exception&) {
    module = nullptr;
  }
  if (!module) return;
  int i = 1;
  while (i <= m_count) {
    if (m_entries[static_cast<size_t>(i - 1)].CodeModule != module) {
      ++i;
      continue;
    }
    std::move(m_entries.begin() + i, m_entries.begin() + m_count, m_entries.begin() + i - 1);
    m_entries[static_cast<size_t>(m_count - 1)] = HISTORY_ENTRY();
    --m_count;
    if (i <= m_currentIndex) {
      --m_currentIndex;
      m_current = m_currentIndex > 0 ? m_entries[static_cast<size_t>(m_currentIndex - 1)] : HISTORY_ENTRY();
    }
  }
  if (m_current.CodeModule == module) {
    m_current = HISTORY_ENTRY();
    m_currentIndex = 0;
    setBack(false);
    setForward(false);
  }
  // With every place gone there is nothing to go back or forward to.
  if (m_count == 0) {
    setBack(false);
    setForward(false);
  }
}

bool CHistories::take(int index) {
  // Copied first, so that the timer sees the shown place as the current one and records no visit.
  m_current = m_entries[static_cast<size_t>(index - 1)];
  return show(m_current);
}

bool CHistories::show(const HISTORY_ENTRY& place) {
  if (m_busy) return true;
  m_busy = true;
  struct BusyReset {
    bool& flag;
    ~BusyReset() { flag = false; }
  } reset{m_busy};

  if (!ownerOf(place.CodeModule)) {
    ClearHistories(CA_TOTAL);
    return false;
  }
  const HISTORY_ENTRY shown = place;  // `place` is the current position, which the calls below may not touch
  auto pane = shown.CodeModule->CodePane();
  pane->Show();
  m_vbe.setActiveCodePane(pane);
  m_vbe.Platform().windows().SetForegroundWindow(pane->Window()->hWnd());
  pane->setTopLine(std::max(shown.TopLine, 1));
  try {
    pane->SetSelection(shown.TopLine, 1, shown.TopLine, 1);
  } catch (const std::exception& failure) {
    // The caret stays where it was; the place itself is shown.
    common::logFailure(failure, QStringLiteral("CHistories"), QStringLiteral("show"), __LINE__);
  }
  return true;
}

}  // namespace navigation
