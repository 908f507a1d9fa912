// SPDX-License-Identifier: MIT
// A form designer window: the form drawn as the IDE shows it (FormPainter) with its controls at their
// places and sizes (FormGeometry: twips to pixels at 15 twips per pixel, on the IDE's 120-twip grid), a
// selection with grab handles, moving and sizing with the mouse, Delete to remove. Every change goes
// through the form's controls, so that the model fires the control events.
#pragma once

#include "formgeometry.h"
#include "formpainter.h"
#include "host/model/designer.h"
#include "host/model/objects.h"
#include "ide/signal.h"

#include <QScrollArea>

#include <functional>

#include <memory>

namespace desktop {

class FormCanvas;

class DesignerWindow final : public QScrollArea {
  Q_OBJECT

 public:
  explicit DesignerWindow(const std::shared_ptr<host::WindowImpl>& window, QWidget* parent = nullptr);
  ~DesignerWindow() override;

  const std::shared_ptr<host::WindowImpl>& window() const { return m_window; }
  std::shared_ptr<host::FormImpl> form() const;
  /// The selected control; null when the form itself is selected.
  std::shared_ptr<host::ControlImpl> selectedControl() const;
  void selectControl(const std::shared_ptr<host::ControlImpl>& control);
  /// Adds an intrinsic control ("TextBox") into the selected container, or the form, and selects it.
  std::shared_ptr<host::ControlImpl> addControl(const QString& className);
  FormCanvas* canvas() const { return m_canvas; }

 Q_SIGNALS:
  void selectionChanged();
  /// The user double-clicked a control or the form: its code is wanted.
  void codeWanted();

 private:
  std::shared_ptr<host::WindowImpl> m_window;
  FormCanvas* m_canvas;
};

/// The drawing of a form and the mouse and keyboard work on it.
class FormCanvas final : public QWidget {
  Q_OBJECT

 public:
  FormCanvas(std::shared_ptr<host::FormImpl> form, QWidget* parent = nullptr);
  ~FormCanvas() override;

  std::shared_ptr<host::FormImpl> form() const { return m_form; }
  std::shared_ptr<host::ControlImpl> selected() const { return m_selected.lock(); }
  void setSelected(const std::shared_ptr<host::ControlImpl>& control);
  /// The control's rectangle on the canvas (empty for controls drawn nowhere, such as menus).
  QRect rectOf(const std::shared_ptr<host::ControlImpl>& control);
  /// Where the form's client area starts on the canvas.
  QPoint clientOrigin();
  const FormGeometry& geometry() const { return m_geometry; }
  QSize sizeHint() const override;
  /// Where refusals of the form (a control that cannot go there ...) are told.
  void setErrorReporter(std::function<void(const QString&)> reporter) { m_report = std::move(reporter); }

 Q_SIGNALS:
  void selectionChanged();
  void codeWanted();

 protected:
  void paintEvent(QPaintEvent* event) override;
  void mousePressEvent(QMouseEvent* event) override;
  void mouseMoveEvent(QMouseEvent* event) override;
  void mouseReleaseEvent(QMouseEvent* event) override;
  void mouseDoubleClickEvent(QMouseEvent* event) override;
  void keyPressEvent(QKeyEvent* event) override;

 private:
  enum class Drag { None, Move, Resize };
  void relayout();
  std::shared_ptr<host::ControlImpl> controlAt(const QPoint& point);
  int handleAt(const QPoint& point);
  void report(const ide::Error& error);

  std::shared_ptr<host::FormImpl> m_form;
  FormGeometry m_geometry;
  PictureCache m_pictures;
  std::weak_ptr<host::ControlImpl> m_selected;
  ide::Connection m_changed;
  Drag m_drag = Drag::None;
  int m_handle = -1;
  QPoint m_pressPoint;
  QRect m_startRect;
  QRect m_dragRect;
  QSize m_size;
  std::function<void(const QString&)> m_report;
};

}  // namespace desktop
