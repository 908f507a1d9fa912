// SPDX-License-Identifier: MIT
// A progress bar for tests: it remembers its state and every value it was given.
#pragma once

#include "walk/progress.h"

#include <functional>
#include <vector>

namespace transform::test {

/// A progress bar that remembers its state and every value it was given.
class RecordingBar final : public walk::ProgressSink {
 public:
  int minimum() const override { return m_minimum; }
  void setMinimum(int minimum) override { m_minimum = minimum; }
  int maximum() const override { return m_maximum; }
  void setMaximum(int maximum) override { m_maximum = maximum; }
  int value() const override { return m_value; }
  void setValue(int value) override {
    m_value = value;
    values.push_back(value);
    if (onValue) onValue(value);
  }
  bool isVisible() const override { return m_visible; }
  void setVisible(bool visible) override { m_visible = visible; }

  std::vector<int> values;
  std::function<void(int)> onValue;

 private:
  int m_minimum = 0;
  int m_maximum = 100;
  int m_value = 0;
  bool m_visible = false;
};

}  // namespace transform::test
