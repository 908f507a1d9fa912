// SPDX-License-Identifier: MIT
// The browse history: the ten most recent code places the programmer worked in, and moving back and
// forward through them like a web browser. The timer (browsesampler.h) decides when a place is recorded;
// this class keeps the places, shows them and sets the back and forward entries of the command state.
#pragma once

#include "common/commandstate.h"
#include "ide/vbide.h"

#include <QString>

#include <array>

namespace navigation {

enum BROWSE_DIR : int { BD_BACKWARD = 1, BD_FORWARD = 2 };
enum CLEAR_ACTION : int { CA_TOTAL = 1, CA_FORWARD = 2 };

/// A code place: the module shown in a code pane, the procedure holding its middle visible line, the first
/// visible line and the selection.
struct HISTORY_ENTRY {
  ide::Ref<ide::CodeModule> CodeModule;
  QString ProcName;
  ide::ProcKind ProcKind = ide::ProcKind::Proc;
  int TopLine = 0;
  int StartLine = 0;
  int StartColumn = 0;
  int EndLine = 0;
  int EndColumn = 0;
};

class CHistories {
 public:
  static constexpr int kCapacity = 10;
  /// Both references must outlive the history.
  CHistories(ide::VBE& vbe, common::CommandState& commandState);
  CHistories(const CHistories&) = delete;
  CHistories& operator=(const CHistories&) = delete;

  /// CA_TOTAL empties everything; CA_FORWARD drops the places after the one being shown.
  void ClearHistories(CLEAR_ACTION action);
  /// Appends the current position as the newest place (the oldest goes when all ten are in use).
  void AddHistory();
  /// Moves back or forward one place and shows it. Failures of the IDE calls are raised.
  void Browse(BROWSE_DIR direction);
  void SetTopLineOfLastHistory(int topLine);
  /// Forgets every place in the component's code module (the component is being removed).
  void RemoveHistoriesOfComponent(const ide::Ref<ide::VBComponent>& component);

  /// 0 while the programmer is not browsing, else the index (1-based) of the place being shown.
  int CurrentHistoryIndex() const { return m_currentIndex; }
  int HistoryCount() const { return m_count; }
  /// Place 1 (oldest) to HistoryCount (newest).
  const HISTORY_ENTRY& entry(int index) const { return m_entries.at(static_cast<size_t>(index - 1)); }

  /// Where the programmer is now, as the timer last saw it.
  HISTORY_ENTRY& CurrentPosition() { return m_current; }
  const HISTORY_ENTRY& CurrentPosition() const { return m_current; }
  /// True while the history itself moves the IDE to a place.
  bool busy() const { return m_busy; }

 private:
  /// Copies place `index` into the current position and shows it; false when its component is gone, in
  /// which case the whole history has been cleared.
  bool take(int index);
  bool show(const HISTORY_ENTRY& place);
  void setBack(bool enabled) { m_state.set(common::CommandId::BrowseBackward, enabled); }
  void setForward(bool enabled) { m_state.set(common::CommandId::BrowseForward, enabled); }

  ide::VBE& m_vbe;
  common::CommandState& m_state;
  std::array<HISTORY_ENTRY, kCapacity> m_entries;
  int m_count = 0;
  int m_currentIndex = 0;
  HISTORY_ENTRY m_current;
  bool m_busy = false;
};

}  // namespace navigation
