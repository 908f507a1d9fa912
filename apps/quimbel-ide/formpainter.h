// SPDX-License-Identifier: MIT
// Drawing a form in the designer as the IDE shows it: the window frame and title bar with the buttons its
// properties allow, the menu bar, the client area with its grid and picture, and each intrinsic control in
// the classic look (3-D or flat by its Appearance) with its own font, pictures and list items. A user
// control of an open project shows what its own designer holds, scaled to the instance; controls the
// designer cannot draw (ActiveX controls) are boxes naming their class. What a container holds is drawn
// on top of it.
#pragma once

#include "formgeometry.h"

#include <QByteArray>
#include <QHash>
#include <QImage>

class QPainter;

namespace desktop {

/// The pictures of a form, decoded once each (BMP, ICO, GIF, JPEG; a format Qt cannot read gives a null
/// image, and the control is drawn without it).
class PictureCache {
 public:
  const QImage& image(const QByteArray& bytes);
  void clear() { m_images.clear(); }

 private:
  QHash<QByteArray, QImage> m_images;
};

class FormPainter {
 public:
  FormPainter(QPainter& painter, const FormGeometry& geometry, PictureCache& pictures)
      : m_painter(painter), m_geometry(geometry), m_pictures(pictures) {}

  /// The window: frame, title bar, menu bar and the client area with its picture and grid.
  void paintWindow(int grid);
  /// Every control of the form, in the order the form draws them, clipped to their containers.
  /// `depth` counts the user controls being drawn inside each other.
  void paintControls(int depth = 0);
  /// One control at `rect` (its rectangle from the geometry).
  void paintControl(const std::shared_ptr<host::ControlImpl>& control, const QRect& rect, int depth = 0);

  /// A scroll bar with its two arrow buttons and its thumb.
  static void paintScrollBar(QPainter& painter, const QRect& rect, Qt::Orientation orientation);

 private:
  enum class Edge { None, Flat, Sunken };
  /// The border a control's BorderStyle and Appearance give it; returns the area inside.
  QRect paintBorder(const QRect& rect, Edge edge, const QColor& fill);
  Edge edgeOf(host::ControlImpl& control, int defaultBorderStyle);
  void paintRaised(const QRect& rect, const QColor& face, bool thick = true);
  void paintText(const QRect& area, int flags, const QString& text, const QColor& color, bool enabled);
  void paintCaptionButton(const QRect& rect, int glyph, bool enabled);
  void paintPicture(const QVariant& value, const QRect& area, bool stretch, bool centered = false);
  void paintCheckIndicator(const QRect& box, int value, bool flat);
  void paintOptionIndicator(const QRect& box, bool on, bool flat);
  void paintList(const QRect& inner, host::ControlImpl& control, const QStringList& items, bool checkBoxes);

  // The painters of the control classes, found by class name in one table.
  struct Look;
  using ControlPainterFn = void (FormPainter::*)(const Look&);
  static const QHash<QString, ControlPainterFn>& painters();
  void paintCommandButton(const Look& look);
  void paintLabel(const Look& look);
  void paintTextBox(const Look& look);
  void paintComboBox(const Look& look);
  void paintListBox(const Look& look);
  void paintFrame(const Look& look);
  void paintCheckOrOption(const Look& look);
  void paintPictureBox(const Look& look);
  void paintImage(const Look& look);
  void paintTimer(const Look& look);
  void paintScrollBarControl(const Look& look);
  void paintShape(const Look& look);
  void paintLine(const Look& look);
  void paintUserControl(const Look& look, const std::shared_ptr<host::ControlImpl>& userControl);
  void paintUnknown(const Look& look);
  static int alignmentOf(host::ControlImpl& control);

  QPainter& m_painter;
  const FormGeometry& m_geometry;
  PictureCache& m_pictures;
  bool m_compatibleMetrics = true;  // the current font's stand-in takes the room the font takes
};

}  // namespace desktop
