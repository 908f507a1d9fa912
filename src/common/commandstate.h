// SPDX-License-Identifier: MIT
// Which of the add-in's commands may run now: entry n - 1 gates command n. A click on a command whose entry
// is false does nothing; the browse history owns entries 0 and 1, the dispatch and the timer the rest.
#pragma once

#include <array>
#include <cstddef>

namespace common {

class CommandState {
 public:
  static constexpr int kCount = 14;

  bool operator[](int entry) const { return entry >= 0 && entry < kCount && m_entries[index(entry)]; }
  void set(int entry, bool enabled) {
    if (entry >= 0 && entry < kCount) m_entries[index(entry)] = enabled;
  }
  /// Sets entries `first` to `last`, both included.
  void setRange(int first, int last, bool enabled) {
    for (int entry = first; entry <= last; ++entry)
      set(entry, enabled);
  }

 private:
  static std::size_t index(int entry) { return static_cast<std::size_t>(entry); }
  std::array<bool, kCount> m_entries{};
};

}  // namespace common
