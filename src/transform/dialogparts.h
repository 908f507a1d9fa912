// SPDX-License-Identifier: MIT
// Pieces the numbering and indentation dialogs share: the numbers-only edit box, the progress bar as a
// progress sink, the busy cursor and the dialogs' reading of numbers.
#pragma once

#include "ide/platform.h"
#include "walk/progmode.h"
#include "walk/progress.h"
#include "walk/walk.h"

#include <QLineEdit>

class QProgressBar;

namespace transform {

/// An edit box that takes digits only: letters can be neither typed nor pasted (Ctrl+V, Shift+Insert,
/// a context menu or a drop). Getting the focus selects the whole text, so a new value replaces the old.
class NumberBox final : public QLineEdit {
  Q_OBJECT

 public:
  explicit NumberBox(QWidget* parent = nullptr);

 protected:
  void keyPressEvent(QKeyEvent* event) override;
  void focusInEvent(QFocusEvent* event) override;
};

/// A QProgressBar seen by the walks. Visibility is the bar's own (shown or hidden by the dialog's
/// run), not whether the dialog is on screen.
class ProgressBarSink final : public walk::ProgressSink {
 public:
  explicit ProgressBarSink(QProgressBar& bar) : m_bar(bar) {}

  int minimum() const override;
  void setMinimum(int minimum) override;
  int maximum() const override;
  void setMaximum(int maximum) override;
  int value() const override;
  void setValue(int value) override;
  bool isVisible() const override;
  void setVisible(bool visible) override;

 private:
  QProgressBar& m_bar;
};

/// What a dialog says about a failure of its walk over `scope`: `message` (the walk's fixed text), then the
/// module (when the walk did not name it, the one the scope walks) and the code-window line it happened
/// at, and why, in the dialog's language.
QString walkFailureText(const QString& message, const walk::WalkFailure& failure, ide::VBE& vbe,
                        walk::PROG_MODE scope);

/// The fixed message of a failed run over `scope`: the indentation's (5130, 5129, 5128) for `indenting`,
/// else the numbering's (5121, 5122, 5123).
int walkMessageId(walk::PROG_MODE scope, bool indenting);

/// Shows the arrow-and-hourglass cursor while it lives.
class BusyCursor {
 public:
  explicit BusyCursor(ide::UserInterface& ui)
      : m_ui(ui), m_previous(ui.setCursor(ide::Cursor::ArrowHourglass)) {}
  ~BusyCursor() { m_ui.setCursor(m_previous); }
  BusyCursor(const BusyCursor&) = delete;
  BusyCursor& operator=(const BusyCursor&) = delete;

 private:
  ide::UserInterface& m_ui;
  ide::Cursor m_previous;
};

}  // namespace transform
