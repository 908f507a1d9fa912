// SPDX-License-Identifier: MIT
// Progress of long walks on a bar that takes at most 32767 steps: larger runs are scaled so that the bar
// fills once over the whole run. The bar itself stays behind ProgressSink, so dialogs, the
// number-and-indent command and a terminal bar share the arithmetic.
#pragma once

#include <QtGlobal>

namespace walk {

/// A progress bar as the walks see it.
class ProgressSink {
 public:
  virtual ~ProgressSink() = default;

  virtual int minimum() const = 0;
  virtual void setMinimum(int minimum) = 0;
  virtual int maximum() const = 0;
  virtual void setMaximum(int maximum) = 0;
  virtual int value() const = 0;
  virtual void setValue(int value) = 0;
  virtual bool isVisible() const = 0;
  virtual void setVisible(bool visible) = 0;
};

/// Maps the units of a run (members, lines) onto the steps of a ProgressSink. Does not own the sink,
/// which must outlive it; showing and hiding the bar is left to the caller.
class ProgressScale {
 public:
  /// The most steps a bar takes.
  static constexpr qint32 kMaxSteps = 32767;

  explicit ProgressScale(ProgressSink& sink) : m_sink(sink) {}

  /// Sets the bar for a run of `units`: up to kMaxSteps units one step each, more units scaled to
  /// kMaxSteps steps, no units a one-step bar. The bar starts empty.
  void SetProgressRange(qint32 units);

  /// Moves the bar by `units`, rounded to whole steps, never past its maximum. Nothing moves for 0 units
  /// or on a full bar.
  void AdvanceProgress(qint32 units);

  /// Units per step: 1, or units / kMaxSteps for runs longer than the bar.
  double scale() const { return m_scale; }
  /// The units of the run last set.
  qint32 totalUnits() const { return m_totalUnits; }
  ProgressSink& sink() const { return m_sink; }

 private:
  ProgressSink& m_sink;
  double m_scale = 1.0;
  qint32 m_totalUnits = 0;
};

}  // namespace walk
