// SPDX-License-Identifier: MIT
#include "host/platform/manualloop.h"

#include <algorithm>

namespace host {

int ManualEventLoop::SetTimer(int intervalMs, std::function<void()> callback) {
  if (intervalMs <= 0 || !callback) return 0;
  const int id = m_nextId++;
  m_timers.emplace(id, Timer{intervalMs, m_now + intervalMs, std::move(callback)});
  return id;
}

bool ManualEventLoop::KillTimer(int timerId) {
  return m_timers.erase(timerId) > 0;
}

void ManualEventLoop::post(std::function<void()> work) {
  if (work) m_posted.push_back(std::move(work));
}

void ManualEventLoop::runPosted() {
  // Work posted while this runs waits for the next round only if we are nested; at the top level, drain.
  while (!m_posted.empty()) {
    auto work = std::move(m_posted.front());
    m_posted.pop_front();
    work();
  }
}

void ManualEventLoop::fireDue() {
  for (;;) {
    auto next = std::min_element(m_timers.begin(), m_timers.end(),
                                 [](const auto& a, const auto& b) { return a.second.due < b.second.due; });
    if (next == m_timers.end() || next->second.due > m_now) return;
    next->second.due += next->second.interval;
    // Copy: the callback may kill its own timer.
    const auto callback = next->second.callback;
    callback();
    runPosted();
  }
}

void ManualEventLoop::DoEvents() {
  if (m_depth > 4) return;  // a walk that yields from inside a yield gains nothing from going deeper
  ++m_depth;
  runPosted();
  fireDue();
  --m_depth;
}

void ManualEventLoop::advance(qint64 ms) {
  const qint64 target = m_now + std::max<qint64>(ms, 0);
  ++m_depth;
  runPosted();
  for (;;) {
    qint64 nextDue = target;
    for (const auto& [id, timer] : m_timers)
      nextDue = std::min(nextDue, timer.due);
    m_now = std::max(m_now, nextDue);
    fireDue();
    runPosted();
    if (m_now >= target) break;
  }
  --m_depth;
}

}  // namespace host
