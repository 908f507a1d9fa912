// SPDX-License-Identifier: MIT
#include "terminalprogress.h"

#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <string>

namespace cli {

namespace {
// A run shorter than this shows no bar ($QUIMBEL_PROGRESS_AFTER_MS changes it, for tests); a drawn bar is
// redrawn at most this often.
std::chrono::milliseconds showAfter() {
  bool ok = false;
  const int configured = qEnvironmentVariableIntValue("QUIMBEL_PROGRESS_AFTER_MS", &ok);
  return std::chrono::milliseconds(ok && configured >= 0 ? configured : 500);
}
constexpr auto kRedrawEvery = std::chrono::milliseconds(100);
constexpr int kWidth = 40;
}  // namespace

TerminalProgress::TerminalProgress() : m_terminal(isatty(fileno(stderr)) != 0), m_showAfter(showAfter()) {}

TerminalProgress::~TerminalProgress() {
  clear();
}

void TerminalProgress::setValue(int value) {
  m_value = value;
  draw();
}

void TerminalProgress::setVisible(bool visible) {
  m_visible = visible;
  if (!visible) clear();
}

void TerminalProgress::draw() {
  if (!m_terminal || !m_visible) return;
  const auto now = Clock::now();
  if (now - m_started < m_showAfter || now - m_drawn < kRedrawEvery) return;
  const int span = std::max(1, m_maximum - m_minimum);
  const int percent = std::clamp(int(qint64(m_value - m_minimum) * 100 / span), 0, 100);
  if (percent == m_shownPercent) return;
  m_shownPercent = percent;
  m_drawn = now;
  const int filled = percent * kWidth / 100;
  const std::string bar = std::string(size_t(filled), '#') + std::string(size_t(kWidth - filled), '.');
  std::fprintf(stderr, "\rquimbel: [%s] %3d%%", bar.c_str(), percent);
  std::fflush(stderr);
  m_onScreen = true;
}

void TerminalProgress::clear() {
  if (!m_onScreen) return;
  std::fprintf(stderr, "\r%*s\r", kWidth + 16, "");
  std::fflush(stderr);
  m_onScreen = false;
  m_shownPercent = -1;
}

}  // namespace cli
