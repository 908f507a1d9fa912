// SPDX-License-Identifier: MIT
// Where a form designer puts things, in pixels of 15 twips: the window frame that the form's BorderStyle,
// ControlBox, MinButton and MaxButton give it, its client area, and the rectangle of every control inside
// its container (a Frame, a PictureBox, or a user control or ActiveX control holding controls). Reading a
// control's values for drawing goes through the small helpers here, which never fail.
#pragma once

#include "host/model/designer.h"
#include "host/model/objects.h"

#include <QColor>
#include <QPoint>
#include <QRect>
#include <QString>
#include <QVariant>

#include <memory>

namespace desktop {

/// Pixels of a twips value (15 twips per pixel), and back.
inline int pixelsOf(double twips) {
  return static_cast<int>(twips / 15.0 + (twips >= 0 ? 0.5 : -0.5));
}
inline int twipsOf(int pixels) {
  return pixels * 15;
}

/// "TextBox" for "VB.TextBox", "ctlPainel" for "Loja.ctlPainel".
QString bareClass(const QString& className);
/// Menus are held by the form but drawn in its menu bar, not as controls.
bool isMenu(const host::FormNode& node);
/// Controls without a window of their own (labels, images, shapes, lines): drawn below the others.
bool isLightweight(const QString& bareClassName);
/// A property of a control, or `fallback` when the control has none or it cannot be read.
QVariant valueOf(host::ControlImpl& control, const QString& name, const QVariant& fallback = {});
double numberOf(host::ControlImpl& control, const QString& name, double fallback);
QString textOf(host::ControlImpl& control, const QString& name);
/// A VB colour value (RGB as &H00BBGGRR&, or a system colour &H800000nn&) as a QColor.
QColor vbColor(qint32 value);
QColor colorOf(host::ControlImpl& control, const QString& name, QColor fallback);

/// The window frame a form is drawn with.
struct FormFrame {
  int border = 0;       // thickness of the frame around the window (0: none)
  int titleHeight = 0;  // 0: no title bar
  int menuHeight = 0;   // 0: no menu bar
  bool sizable = false;
  bool toolWindow = false;  // the small title bar
  bool icon = false;        // the form's icon at the left of the title bar
  bool closeButton = false;
  bool minMaxButtons = false;  // shown together; each enabled by its own property
  bool minEnabled = false;
  bool maxEnabled = false;
};

class FormGeometry {
 public:
  /// The space around the window inside the designer.
  static constexpr int kMargin = 10;

  explicit FormGeometry(std::shared_ptr<host::FormImpl> form) : m_form(std::move(form)) {}

  const std::shared_ptr<host::FormImpl>& form() const { return m_form; }
  host::ControlImpl& root() const;
  /// The frame of the root: a form's by its properties; a user control, property page or user document has
  /// none.
  FormFrame frame() const;
  /// The window with its frame, the title bar and the client area, on the canvas.
  QRect windowRect() const;
  QRect titleRect() const;
  QPoint clientOrigin() const;
  QSize clientSize() const;
  QSize canvasSize() const;

  /// The control's rectangle on the canvas; empty for controls drawn nowhere (menus, the form itself).
  QRect rectOf(const std::shared_ptr<host::ControlImpl>& control) const;
  /// Where the coordinates of the controls inside `container` start (the client area for the form).
  QPoint containerOrigin(host::FormNode* container) const;
  /// Whether controls can be (or are) inside: Frames and PictureBoxes, a user control whose ControlContainer
  /// is True, and any control that holds controls.
  bool isContainer(host::FormNode* node) const;
  /// The root control of the user control a class names ("Loja.ctlPainel"), when its project is open.
  std::shared_ptr<host::ControlImpl> userControlOf(const QString& className) const;

 private:
  std::shared_ptr<host::FormImpl> m_form;
};

}  // namespace desktop
