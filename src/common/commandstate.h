// SPDX-License-Identifier: MIT
// The add-in's commands by name, and which of them may run now. A click on a command whose state is false
// does nothing; the browse history owns back and forward, the dispatch and the timer the rest.
#pragma once

#include <array>
#include <cstddef>

namespace common {

/// A command's number: its caption is the string resource of that number, and command n is gated by entry
/// n - 1 of the command state. 13 has no command (its entry is set with the range around it).
enum class CommandId : int {
  BrowseBackward = 1,
  BrowseForward = 2,
  Favorites = 3,
  Macros = 4,
  CopyBuffers = 5,
  LinesNumbering = 6,
  Indentation = 7,
  CloseWindows = 8,
  ExtendedFind = 9,
  TaskList = 10,
  NewProcedure = 11,
  Options = 12,
  Help = 14,
  /// "Adicionar aos Favoritos" of the code-window context menus: outside the command state, its controls'
  /// Enabled follows the active window instead.
  AddToFavorites = 20,
};

class CommandState {
 public:
  static constexpr int kCount = 14;

  bool operator[](CommandId command) const {
    const int entry = entryOf(command);
    return entry >= 0 && entry < kCount && m_entries[static_cast<std::size_t>(entry)];
  }
  void set(CommandId command, bool enabled) {
    const int entry = entryOf(command);
    if (entry >= 0 && entry < kCount) m_entries[static_cast<std::size_t>(entry)] = enabled;
  }
  /// Sets the entries of `first` to `last`, both included, and every entry between them.
  void setRange(CommandId first, CommandId last, bool enabled) {
    for (int entry = entryOf(first); entry <= entryOf(last); ++entry)
      if (entry >= 0 && entry < kCount) m_entries[static_cast<std::size_t>(entry)] = enabled;
  }

 private:
  static int entryOf(CommandId command) { return static_cast<int>(command) - 1; }
  std::array<bool, kCount> m_entries{};
};

}  // namespace common
