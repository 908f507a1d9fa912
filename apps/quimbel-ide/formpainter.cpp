// SPDX-License-Identifier: MIT
#include "formpainter.h"

#include "icons.h"
#include "vbfonts.h"

#include <QPainter>
#include <QPainterPath>

#include <functional>

#include <algorithm>

namespace desktop {
namespace {

const QColor kFace(0xd4, 0xd0, 0xc8);
const QColor kShadow(0x80, 0x80, 0x80);
const QColor kDarkShadow(0x40, 0x40, 0x40);
const QColor kHighlight(Qt::white);
constexpr qint32 kButtonFace = static_cast<qint32>(0x8000000F);
constexpr int kScrollBarWidth = 16;
constexpr int kIndicator = 13;

enum CaptionGlyph { Minimize, Maximize, Close };

QImage withFileHeader(const QByteArray& bytes) {
  // A device-independent bitmap without its file header: the header is put in front.
  if (bytes.size() < 40 || static_cast<unsigned char>(bytes[0]) != 40 || bytes[1] || bytes[2] || bytes[3])
    return {};
  QByteArray file("BM");
  const auto le32 = [&](quint32 value) {
    for (int i = 0; i < 4; ++i)
      file.append(static_cast<char>(value >> (8 * i)));
  };
  const quint32 bitCount = static_cast<unsigned char>(bytes[14]);
  quint32 colours = static_cast<unsigned char>(bytes[32]) | static_cast<unsigned char>(bytes[33]) << 8;
  if (colours == 0 && bitCount <= 8) colours = 1u << bitCount;
  le32(static_cast<quint32>(14 + bytes.size()));
  le32(0);
  le32(14 + 40 + 4 * colours);
  return QImage::fromData(file + bytes, "BMP");
}

QString withoutMnemonics(QString text) {
  for (qsizetype i = 0; i < text.size(); ++i)
    if (text[i] == u'&') text.remove(i, 1);  // "&&" keeps one
  return text;
}

}  // namespace

const QImage& PictureCache::image(const QByteArray& bytes) {
  auto found = m_images.find(bytes);
  if (found == m_images.end()) {
    QImage image = QImage::fromData(bytes);
    if (image.isNull()) image = withFileHeader(bytes);
    found = m_images.insert(bytes, image);
  }
  return *found;
}

// ---------------------------------------------------------------------------------------------------
// Primitives

void FormPainter::paintRaised(const QRect& r, const QColor& face, bool thick) {
  m_painter.fillRect(r, face);
  m_painter.setPen(kHighlight);
  m_painter.drawLine(r.topLeft(), r.topRight() - QPoint(1, 0));
  m_painter.drawLine(r.topLeft(), r.bottomLeft() - QPoint(0, 1));
  m_painter.setPen(thick ? kDarkShadow : kShadow);
  m_painter.drawLine(r.bottomLeft(), r.bottomRight());
  m_painter.drawLine(r.topRight(), r.bottomRight());
  if (!thick) return;
  m_painter.setPen(kShadow);
  m_painter.drawLine(r.bottomLeft() + QPoint(1, -1), r.bottomRight() + QPoint(-1, -1));
  m_painter.drawLine(r.topRight() + QPoint(-1, 1), r.bottomRight() + QPoint(-1, -1));
}

FormPainter::Edge FormPainter::edgeOf(host::ControlImpl& control, int defaultBorderStyle) {
  if (numberOf(control, QStringLiteral("BorderStyle"), defaultBorderStyle) == 0) return Edge::None;
  return numberOf(control, QStringLiteral("Appearance"), 1) == 0 ? Edge::Flat : Edge::Sunken;
}

QRect FormPainter::paintBorder(const QRect& r, Edge edge, const QColor& fill) {
  m_painter.fillRect(r, fill);
  switch (edge) {
    case Edge::None:
      return r;
    case Edge::Flat:
      m_painter.setPen(Qt::black);
      m_painter.setBrush(Qt::NoBrush);
      m_painter.drawRect(r.adjusted(0, 0, -1, -1));
      return r.adjusted(1, 1, -1, -1);
    case Edge::Sunken:
      m_painter.setPen(kShadow);
      m_painter.drawLine(r.topLeft(), r.topRight());
      m_painter.drawLine(r.topLeft(), r.bottomLeft());
      m_painter.setPen(kHighlight);
      m_painter.drawLine(r.bottomLeft(), r.bottomRight());
      m_painter.drawLine(r.topRight(), r.bottomRight());
      m_painter.setPen(kDarkShadow);
      m_painter.drawLine(r.topLeft() + QPoint(1, 1), r.topRight() + QPoint(-1, 1));
      m_painter.drawLine(r.topLeft() + QPoint(1, 1), r.bottomLeft() + QPoint(1, -1));
      m_painter.setPen(kFace);
      m_painter.drawLine(r.bottomLeft() + QPoint(1, -1), r.bottomRight() + QPoint(-1, -1));
      m_painter.drawLine(r.topRight() + QPoint(-1, 1), r.bottomRight() + QPoint(-1, -1));
      return r.adjusted(2, 2, -2, -2);
  }
  return r;
}

void FormPainter::paintText(const QRect& area, int flags, const QString& text, const QColor& color,
                            bool enabled) {
  // A stand-in wider than the font the form was designed with is narrowed to the room the text had.
  const qreal scale = fitText(m_painter, area, flags, text, m_compatibleMetrics);
  QRect room = area;
  m_painter.save();
  if (scale < 1.0) {
    m_painter.translate(area.left(), 0);
    m_painter.scale(scale, 1.0);
    room = QRect(0, area.top(), static_cast<int>(area.width() / scale), area.height());
  }
  if (!enabled) {
    // Disabled text is etched: white, and grey above it.
    m_painter.setPen(kHighlight);
    m_painter.drawText(room.translated(1, 1), flags, text);
    m_painter.setPen(kShadow);
  } else {
    m_painter.setPen(color);
  }
  m_painter.drawText(room, flags, text);
  m_painter.restore();
}

void FormPainter::paintPicture(const QVariant& value, const QRect& area, bool stretch, bool centered) {
  if (value.typeId() != QMetaType::QByteArray) return;
  const QImage& image = m_pictures.image(value.toByteArray());
  if (image.isNull()) return;
  m_painter.save();
  m_painter.setClipRect(area, Qt::IntersectClip);
  if (stretch) {
    m_painter.drawImage(area, image);
  } else if (centered) {
    m_painter.drawImage(area.center() - QPoint(image.width() / 2, image.height() / 2), image);
  } else {
    m_painter.drawImage(area.topLeft(), image);
  }
  m_painter.restore();
}

void FormPainter::paintScrollBar(QPainter& painter, const QRect& r, Qt::Orientation orientation) {
  const bool horizontal = orientation == Qt::Horizontal;
  // The track is the classic checkered grey.
  painter.fillRect(r, QBrush(kHighlight));
  painter.fillRect(r, QBrush(kFace, Qt::Dense4Pattern));
  const int button = horizontal ? std::min(r.height(), r.width() / 2) : std::min(r.width(), r.height() / 2);
  const QRect first =
      horizontal ? QRect(r.left(), r.top(), button, r.height()) : QRect(r.left(), r.top(), r.width(), button);
  const QRect last = horizontal ? QRect(r.right() - button + 1, r.top(), button, r.height())
                                : QRect(r.left(), r.bottom() - button + 1, r.width(), button);
  const QRect thumb = horizontal ? QRect(first.right() + 1, r.top(), button, r.height())
                                 : QRect(r.left(), first.bottom() + 1, r.width(), button);
  const auto raised = [&](const QRect& b) {
    painter.fillRect(b, kFace);
    painter.setPen(kFace);
    painter.drawLine(b.topLeft(), b.topRight());
    painter.drawLine(b.topLeft(), b.bottomLeft());
    painter.setPen(kDarkShadow);
    painter.drawLine(b.bottomLeft(), b.bottomRight());
    painter.drawLine(b.topRight(), b.bottomRight());
    painter.setPen(kHighlight);
    painter.drawLine(b.topLeft() + QPoint(1, 1), b.topRight() + QPoint(-1, 1));
    painter.drawLine(b.topLeft() + QPoint(1, 1), b.bottomLeft() + QPoint(1, -1));
    painter.setPen(kShadow);
    painter.drawLine(b.bottomLeft() + QPoint(1, -1), b.bottomRight() + QPoint(-1, -1));
    painter.drawLine(b.topRight() + QPoint(-1, 1), b.bottomRight() + QPoint(-1, -1));
  };
  const auto arrow = [&](const QRect& b, int direction) {  // 0 left, 1 right, 2 up, 3 down
    raised(b);
    const QPoint c = b.center();
    const int size = std::max(2, std::min(b.width(), b.height()) / 4);
    QPolygon triangle;
    switch (direction) {
      case 0:
        triangle << c + QPoint(-size / 2 - 1, 0) << c + QPoint(size / 2, -size) << c + QPoint(size / 2, size);
        break;
      case 1:
        triangle << c + QPoint(size / 2 + 1, 0) << c + QPoint(-size / 2, -size)
                 << c + QPoint(-size / 2, size);
        break;
      case 2:
        triangle << c + QPoint(0, -size / 2 - 1) << c + QPoint(-size, size / 2) << c + QPoint(size, size / 2);
        break;
      default:
        triangle << c + QPoint(0, size / 2 + 1) << c + QPoint(-size, -size / 2)
                 << c + QPoint(size, -size / 2);
        break;
    }
    painter.setPen(Qt::NoPen);
    painter.setBrush(Qt::black);
    painter.drawPolygon(triangle);
    painter.setBrush(Qt::NoBrush);
  };
  arrow(first, horizontal ? 0 : 2);
  arrow(last, horizontal ? 1 : 3);
  if ((horizontal ? r.width() : r.height()) >= 3 * button) raised(thumb);
}

void FormPainter::paintCaptionButton(const QRect& b, int glyph, bool enabled) {
  paintRaised(b, kFace);
  const QColor ink = enabled ? Qt::black : kShadow;
  m_painter.setPen(QPen(ink, 1));
  const QRect g = b.adjusted(4, 3, -5, -4);
  switch (glyph) {
    case Minimize:
      m_painter.fillRect(QRect(g.left(), g.bottom() - 1, std::min(6, g.width()), 2), ink);
      break;
    case Maximize:
      m_painter.drawRect(g);
      m_painter.drawLine(g.topLeft() + QPoint(0, 1), g.topRight() + QPoint(0, 1));
      break;
    default: {
      const QRect x = g.adjusted(1, 0, 0, 0);
      m_painter.setPen(QPen(ink, 1));
      for (int dx = 0; dx < 2; ++dx) {
        m_painter.drawLine(x.topLeft() + QPoint(dx, 0), x.bottomRight() + QPoint(dx - 1, 0));
        m_painter.drawLine(x.topRight() + QPoint(dx - 1, 0), x.bottomLeft() + QPoint(dx, 0));
      }
      break;
    }
  }
}

void FormPainter::paintCheckIndicator(const QRect& box, int value, bool flat) {
  const QRect inner =
      paintBorder(box, flat ? Edge::Flat : Edge::Sunken, value == 2 ? kFace : QColor(Qt::white));
  if (value == 0) return;
  m_painter.setPen(QPen(value == 2 ? kShadow : QColor(Qt::black), 1));
  const QPoint o = inner.topLeft() + QPoint(1, 2);
  for (int i = 0; i < 3; ++i) {
    m_painter.drawLine(o + QPoint(0, 2 + i), o + QPoint(2, 4 + i));
    m_painter.drawLine(o + QPoint(2, 4 + i), o + QPoint(6, i));
  }
}

void FormPainter::paintOptionIndicator(const QRect& box, bool on, bool flat) {
  m_painter.save();
  m_painter.setRenderHint(QPainter::Antialiasing, true);
  const QRectF circle = QRectF(box).adjusted(0.5, 0.5, -0.5, -0.5);
  m_painter.setBrush(Qt::white);
  if (flat) {
    m_painter.setPen(Qt::black);
    m_painter.drawEllipse(circle);
  } else {
    m_painter.setPen(QPen(kShadow, 1));
    m_painter.drawEllipse(circle);
    m_painter.setPen(QPen(kDarkShadow, 1));
    m_painter.drawArc(circle.adjusted(1, 1, -1, -1), 45 * 16, 180 * 16);
  }
  if (on) {
    m_painter.setPen(Qt::NoPen);
    m_painter.setBrush(Qt::black);
    m_painter.drawEllipse(QRectF(box).center(), 2.0, 2.0);
  }
  m_painter.restore();
}

void FormPainter::paintList(const QRect& inner, host::ControlImpl& c, const QStringList& items,
                            bool checkBoxes) {
  const int lineHeight = m_painter.fontMetrics().height();
  QRect area = inner;
  if (static_cast<qsizetype>(items.size()) * lineHeight > inner.height()) {
    paintScrollBar(m_painter,
                   QRect(inner.right() - kScrollBarWidth + 1, inner.top(), kScrollBarWidth, inner.height()),
                   Qt::Vertical);
    area.setRight(inner.right() - kScrollBarWidth);
  }
  m_painter.save();
  m_painter.setClipRect(area, Qt::IntersectClip);
  const QColor fore = colorOf(c, QStringLiteral("ForeColor"), Qt::black);
  int y = area.top();
  for (const QString& item : items) {
    if (y > area.bottom()) break;
    int x = area.left() + 2;
    if (checkBoxes) {
      paintCheckIndicator(QRect(x, y + (lineHeight - kIndicator) / 2, kIndicator, kIndicator), 0, true);
      x += kIndicator + 3;
    }
    paintText(QRect(x, y, area.right() - x, lineHeight), Qt::AlignLeft | Qt::AlignVCenter, item, fore, true);
    y += lineHeight;
  }
  m_painter.restore();
}

// ---------------------------------------------------------------------------------------------------
// The window

void FormPainter::paintWindow(int grid) {
  host::ControlImpl& form = m_geometry.root();
  const FormFrame frame = m_geometry.frame();
  const QRect window = m_geometry.windowRect();
  const QColor face = vbColor(kButtonFace);
  if (frame.border > 0) {
    paintRaised(window, face);
    if (frame.sizable) {
      m_painter.setPen(kFace);
      m_painter.drawRect(window.adjusted(2, 2, -3, -3));
    }
  }

  if (frame.titleHeight > 0) {
    const QRect title = m_geometry.titleRect().adjusted(0, 0, 0, -1);
    QLinearGradient gradient(title.topLeft(), title.topRight());
    gradient.setColorAt(0, QColor(0x0a, 0x24, 0x6a));
    gradient.setColorAt(1, QColor(0xa6, 0xca, 0xf0));
    m_painter.fillRect(title, gradient);
    int textLeft = title.left() + 3;
    if (frame.icon) {
      const QRect iconRect(title.left() + 2, title.center().y() - 7, 16, 16);
      const QVariant icon = valueOf(form, QStringLiteral("Icon"));
      const QImage image =
          icon.typeId() == QMetaType::QByteArray ? m_pictures.image(icon.toByteArray()) : QImage();
      if (!image.isNull()) {
        m_painter.drawImage(iconRect, image);
      } else {
        componentIcon(ide::ComponentType::VBForm).paint(&m_painter, iconRect);
      }
      textLeft = iconRect.right() + 4;
    }
    // Caption buttons from the right: close, then maximise and minimise together.
    const int buttonHeight = title.height() - 4;
    const int buttonWidth = frame.toolWindow ? buttonHeight : buttonHeight + 2;
    int right = title.right() - 2;
    if (frame.closeButton) {
      paintCaptionButton(QRect(right - buttonWidth + 1, title.top() + 2, buttonWidth, buttonHeight), Close,
                         true);
      right -= buttonWidth + 2;
    }
    if (frame.minMaxButtons) {
      paintCaptionButton(QRect(right - buttonWidth + 1, title.top() + 2, buttonWidth, buttonHeight), Maximize,
                         frame.maxEnabled);
      right -= buttonWidth;
      paintCaptionButton(QRect(right - buttonWidth + 1, title.top() + 2, buttonWidth, buttonHeight), Minimize,
                         frame.minEnabled);
      right -= buttonWidth;
    }
    host::ControlFont captionFont{QStringLiteral("Tahoma"), frame.toolWindow ? 7.5 : 8.25, true};
    m_painter.setFont(vbFont(captionFont));
    m_painter.setPen(Qt::white);
    m_painter.drawText(QRect(textLeft, title.top(), right - textLeft, title.height()),
                       Qt::AlignLeft | Qt::AlignVCenter,
                       m_painter.fontMetrics().elidedText(textOf(form, QStringLiteral("Caption")),
                                                          Qt::ElideRight, std::max(0, right - textLeft)));
  }

  const QPoint origin = m_geometry.clientOrigin();
  const QRect client(origin, m_geometry.clientSize());
  if (frame.menuHeight > 0) {
    const QRect menuBar(client.left(), client.top() - frame.menuHeight, client.width(), frame.menuHeight);
    m_painter.fillRect(menuBar, face);
    m_painter.setFont(vbFont({}));
    m_compatibleMetrics = false;
    int x = menuBar.left() + 6;
    for (host::FormNode* child : m_geometry.form()->description().root().children()) {
      if (bareClass(child->className()) != QLatin1StringView("Menu")) continue;
      auto menu = m_geometry.form()->control(child);
      if (!valueOf(*menu, QStringLiteral("Visible"), true).toBool()) continue;
      const QString caption = textOf(*menu, QStringLiteral("Caption"));
      const int width = m_painter.fontMetrics().horizontalAdvance(withoutMnemonics(caption)) + 14;
      paintText(QRect(x, menuBar.top(), width, menuBar.height()), Qt::AlignCenter | Qt::TextShowMnemonic,
                caption, Qt::black, valueOf(*menu, QStringLiteral("Enabled"), true).toBool());
      x += width;
    }
  }

  m_painter.fillRect(client, colorOf(form, QStringLiteral("BackColor"), face));
  paintPicture(valueOf(form, QStringLiteral("Picture")), client, false);
  if (grid > 0) {
    m_painter.setPen(Qt::black);
    for (int y = client.top(); y < client.bottom(); y += grid)
      for (int x = client.left(); x < client.right(); x += grid)
        m_painter.drawPoint(x, y);
  }
}

// ---------------------------------------------------------------------------------------------------
// Controls

void FormPainter::paintControls(int depth) {
  const QRect client(m_geometry.clientOrigin(), m_geometry.clientSize());
  // Lightweight controls below windowed ones, as the form draws them; containers before what they hold,
  // which is clipped to them.
  std::function<void(host::FormNode*, bool)> paintChildren = [&](host::FormNode* node, bool lightweight) {
    const QRect clip = node->parent() ? m_geometry.rectOf(m_geometry.form()->control(node)) : client;
    for (host::FormNode* child : node->children()) {
      if (isMenu(*child)) continue;
      auto control = m_geometry.form()->control(child);
      const QRect rect = m_geometry.rectOf(control);
      if (isLightweight(bareClass(child->className())) == lightweight) {
        m_painter.save();
        m_painter.setClipRect(clip, Qt::IntersectClip);
        paintControl(control, rect, depth);
        m_painter.restore();
      }
      if (!lightweight && m_geometry.isContainer(child)) {
        m_painter.save();
        m_painter.setClipRect(rect.intersected(clip), Qt::IntersectClip);
        paintChildren(child, true);
        paintChildren(child, false);
        m_painter.restore();
      }
    }
  };
  paintChildren(&m_geometry.form()->description().root(), true);
  paintChildren(&m_geometry.form()->description().root(), false);
}

/// What every control's painter starts from.
struct FormPainter::Look {
  host::ControlImpl& c;
  QRect r;
  QString kind;
  QColor face, back, fore;
  bool enabled, flat;
  QString caption;
  int lineHeight;
  int depth;
};

const QHash<QString, FormPainter::ControlPainterFn>& FormPainter::painters() {
  static const QHash<QString, ControlPainterFn> table = {
      {QStringLiteral("CommandButton"), &FormPainter::paintCommandButton},
      {QStringLiteral("Label"), &FormPainter::paintLabel},
      {QStringLiteral("TextBox"), &FormPainter::paintTextBox},
      {QStringLiteral("ComboBox"), &FormPainter::paintComboBox},
      {QStringLiteral("DriveListBox"), &FormPainter::paintComboBox},
      {QStringLiteral("ListBox"), &FormPainter::paintListBox},
      {QStringLiteral("FileListBox"), &FormPainter::paintListBox},
      {QStringLiteral("DirListBox"), &FormPainter::paintListBox},
      {QStringLiteral("Frame"), &FormPainter::paintFrame},
      {QStringLiteral("CheckBox"), &FormPainter::paintCheckOrOption},
      {QStringLiteral("OptionButton"), &FormPainter::paintCheckOrOption},
      {QStringLiteral("PictureBox"), &FormPainter::paintPictureBox},
      {QStringLiteral("Image"), &FormPainter::paintImage},
      {QStringLiteral("Timer"), &FormPainter::paintTimer},
      {QStringLiteral("HScrollBar"), &FormPainter::paintScrollBarControl},
      {QStringLiteral("VScrollBar"), &FormPainter::paintScrollBarControl},
      {QStringLiteral("Shape"), &FormPainter::paintShape},
      {QStringLiteral("Line"), &FormPainter::paintLine},
  };
  return table;
}

void FormPainter::paintControl(const std::shared_ptr<host::ControlImpl>& control, const QRect& r, int depth) {
  host::ControlImpl& c = *control;
  const QString className = c.liveNode().className();
  const QColor face = vbColor(kButtonFace);
  const host::ControlFont font = c.font();
  m_painter.setFont(vbFont(font));
  m_compatibleMetrics = hasCompatibleMetrics(font.name);
  Look look{c,
            r,
            bareClass(className),
            face,
            colorOf(c, QStringLiteral("BackColor"), face),
            colorOf(c, QStringLiteral("ForeColor"), Qt::black),
            valueOf(c, QStringLiteral("Enabled"), true).toBool(),
            numberOf(c, QStringLiteral("Appearance"), 1) == 0,
            textOf(c, QStringLiteral("Caption")),
            m_painter.fontMetrics().height(),
            depth};
  // Intrinsic controls are written "VB.Label" (or bare); a user control "Project.ctlName" may share a name.
  const bool intrinsic = !className.contains(u'.') || className.startsWith(QLatin1StringView("VB."));
  if (const auto painter = painters().find(look.kind); intrinsic && painter != painters().end())
    (this->*(*painter))(look);
  else if (auto userControl = m_geometry.userControlOf(className))
    paintUserControl(look, userControl);
  else
    paintUnknown(look);
}

void FormPainter::paintCommandButton(const Look& l) {
  QRect inner = l.r;
  if (valueOf(l.c, QStringLiteral("Default"), false).toBool()) {
    m_painter.setPen(Qt::black);
    m_painter.drawRect(l.r.adjusted(0, 0, -1, -1));
    inner = l.r.adjusted(1, 1, -1, -1);
  }
  if (l.flat)
    paintBorder(inner, Edge::Flat, l.back);
  else
    paintRaised(inner, l.back);
  const QRect area = inner.adjusted(3, 3, -3, -3);
  if (numberOf(l.c, QStringLiteral("Style"), 0) == 1) {
    const QRect pictureArea = l.caption.isEmpty() ? area : area.adjusted(0, 0, 0, -l.lineHeight);
    paintPicture(valueOf(l.c, QStringLiteral("Picture")), pictureArea, false, true);
    paintText(area, Qt::AlignHCenter | Qt::AlignBottom | Qt::TextShowMnemonic | Qt::TextWordWrap, l.caption,
              l.fore, l.enabled);
  } else {
    paintText(area, Qt::AlignCenter | Qt::TextShowMnemonic | Qt::TextWordWrap, l.caption, l.fore, l.enabled);
  }
}

void FormPainter::paintLabel(const Look& l) {
  if (numberOf(l.c, QStringLiteral("BackStyle"), 1) != 0) m_painter.fillRect(l.r, l.back);
  const Edge edge = edgeOf(l.c, 0);
  const QRect inner = edge == Edge::None ? l.r : paintBorder(l.r, edge, l.back);
  // A label breaks its caption at words unless it sizes itself to one line (AutoSize without WordWrap).
  const bool wrap = !valueOf(l.c, QStringLiteral("AutoSize"), false).toBool() ||
                    valueOf(l.c, QStringLiteral("WordWrap"), false).toBool();
  const bool mnemonic = valueOf(l.c, QStringLiteral("UseMnemonic"), true).toBool();
  paintText(
      inner,
      alignmentOf(l.c) | Qt::AlignTop | (wrap ? Qt::TextWordWrap : 0) | (mnemonic ? Qt::TextShowMnemonic : 0),
      l.caption, l.fore, l.enabled);
}

void FormPainter::paintTextBox(const Look& l) {
  QRect inner = paintBorder(l.r, edgeOf(l.c, 1), colorOf(l.c, QStringLiteral("BackColor"), Qt::white));
  const bool multiLine = valueOf(l.c, QStringLiteral("MultiLine"), false).toBool();
  const int bars = multiLine ? static_cast<int>(numberOf(l.c, QStringLiteral("ScrollBars"), 0)) : 0;
  const bool vertical = bars == 2 || bars == 3;
  const bool horizontal = bars == 1 || bars == 3;
  if (vertical)
    paintScrollBar(m_painter,
                   QRect(inner.right() - kScrollBarWidth + 1, inner.top(), kScrollBarWidth,
                         inner.height() - (horizontal ? kScrollBarWidth : 0)),
                   Qt::Vertical);
  if (horizontal)
    paintScrollBar(m_painter,
                   QRect(inner.left(), inner.bottom() - kScrollBarWidth + 1,
                         inner.width() - (vertical ? kScrollBarWidth : 0), kScrollBarWidth),
                   Qt::Horizontal);
  if (vertical && horizontal)
    m_painter.fillRect(QRect(inner.right() - kScrollBarWidth + 1, inner.bottom() - kScrollBarWidth + 1,
                             kScrollBarWidth, kScrollBarWidth),
                       l.face);
  inner.adjust(1, 1, -(vertical ? kScrollBarWidth : 0), -(horizontal ? kScrollBarWidth : 0));
  QString text = textOf(l.c, QStringLiteral("Text"));
  const QString password = textOf(l.c, QStringLiteral("PasswordChar"));
  if (!password.isEmpty() && !multiLine) text = QString(text.size(), password.front());
  if (!multiLine) text = text.section(QStringLiteral("\r\n"), 0, 0);
  text.replace(QStringLiteral("\r\n"), QStringLiteral("\n"));
  m_painter.save();
  m_painter.setClipRect(inner, Qt::IntersectClip);
  // A multi-line box without a horizontal scroll bar breaks its lines at words.
  paintText(inner.adjusted(1, 0, -1, 0),
            alignmentOf(l.c) | Qt::AlignTop | (multiLine && !horizontal ? Qt::TextWordWrap : 0), text,
            colorOf(l.c, QStringLiteral("ForeColor"), Qt::black), l.enabled);
  m_painter.restore();
}

void FormPainter::paintComboBox(const Look& l) {
  const bool combo = l.kind == QLatin1StringView("ComboBox");
  const int style = combo ? static_cast<int>(numberOf(l.c, QStringLiteral("Style"), 0)) : 0;
  const QColor window = colorOf(l.c, QStringLiteral("BackColor"), Qt::white);
  const int boxHeight = style == 1 ? std::min(l.r.height(), l.lineHeight + 6) : l.r.height();
  const QRect box(l.r.topLeft(), QSize(l.r.width(), boxHeight));
  const QRect inner = paintBorder(box, l.flat ? Edge::Flat : Edge::Sunken, window);
  const QString text = !combo       ? QStringLiteral("c: [ ]")
                       : style == 2 ? l.c.name()
                                    : textOf(l.c, QStringLiteral("Text"));
  int textRight = inner.right();
  if (style != 1) {
    const QRect button(inner.right() - kScrollBarWidth + 1, inner.top(), kScrollBarWidth, inner.height());
    paintRaised(button, l.face);
    const QPoint m = button.center();
    m_painter.setPen(Qt::NoPen);
    m_painter.setBrush(Qt::black);
    m_painter.drawPolygon(QPolygon({m + QPoint(-3, -1), m + QPoint(3, -1), m + QPoint(0, 2)}));
    m_painter.setBrush(Qt::NoBrush);
    textRight = button.left() - 1;
  }
  paintText(QRect(inner.left() + 2, inner.top(), textRight - inner.left() - 2, inner.height()),
            Qt::AlignLeft | Qt::AlignVCenter, text, l.fore, l.enabled);
  if (style == 1 && l.r.height() > boxHeight) {
    const QRect list(l.r.left(), box.bottom() + 1, l.r.width(), l.r.height() - boxHeight);
    paintList(paintBorder(list, l.flat ? Edge::Flat : Edge::Sunken, window), l.c,
              valueOf(l.c, QStringLiteral("List")).toStringList(), false);
  }
}

void FormPainter::paintListBox(const Look& l) {
  const QRect inner = paintBorder(l.r, l.flat ? Edge::Flat : Edge::Sunken,
                                  colorOf(l.c, QStringLiteral("BackColor"), Qt::white));
  QStringList items = valueOf(l.c, QStringLiteral("List")).toStringList();
  // An empty list shows its name at design time.
  if (items.isEmpty() && l.kind == QLatin1StringView("ListBox")) items << l.c.name();
  if (l.kind == QLatin1StringView("DirListBox")) items = {QStringLiteral("c:\\")};
  paintList(inner, l.c, items, numberOf(l.c, QStringLiteral("Style"), 0) == 1);
}

void FormPainter::paintFrame(const Look& l) {
  m_painter.fillRect(l.r, l.back);
  if (numberOf(l.c, QStringLiteral("BorderStyle"), 1) != 0) {
    const QRect box = l.r.adjusted(0, l.lineHeight / 2, -1, -1);
    m_painter.setBrush(Qt::NoBrush);
    if (l.flat) {
      m_painter.setPen(Qt::black);
      m_painter.drawRect(box);
    } else {
      m_painter.setPen(kShadow);
      m_painter.drawRect(box.adjusted(0, 0, -1, -1));
      m_painter.setPen(kHighlight);
      m_painter.drawRect(box.adjusted(1, 1, 0, 0));
    }
  }
  if (l.caption.isEmpty()) return;
  const int width =
      std::min(m_painter.fontMetrics().horizontalAdvance(withoutMnemonics(l.caption)) + 4, l.r.width() - 10);
  m_painter.fillRect(QRect(l.r.left() + 6, l.r.top(), width, l.lineHeight), l.back);
  paintText(QRect(l.r.left() + 8, l.r.top(), width, l.lineHeight),
            Qt::AlignLeft | Qt::AlignVCenter | Qt::TextShowMnemonic, l.caption, l.fore, l.enabled);
}

void FormPainter::paintCheckOrOption(const Look& l) {
  const bool check = l.kind == QLatin1StringView("CheckBox");
  const int value = static_cast<int>(check ? numberOf(l.c, QStringLiteral("Value"), 0)
                                           : (valueOf(l.c, QStringLiteral("Value"), false).toBool() ? 1 : 0));
  if (numberOf(l.c, QStringLiteral("Style"), 0) == 1) {  // Graphical: a button, pressed when on
    if (value)
      paintBorder(l.r, Edge::Sunken, l.back);
    else
      paintRaised(l.r, l.back);
    paintPicture(valueOf(l.c, QStringLiteral("Picture")), l.r.adjusted(3, 3, -3, -3 - l.lineHeight), false,
                 true);
    paintText(l.r.adjusted(3, 3, -3, -3), Qt::AlignHCenter | Qt::AlignBottom | Qt::TextShowMnemonic,
              l.caption, l.fore, l.enabled);
    return;
  }
  m_painter.fillRect(l.r, l.back);
  const bool right = numberOf(l.c, QStringLiteral("Alignment"), 0) == 1;
  const QRect box(right ? l.r.right() - kIndicator + 1 : l.r.left(), l.r.center().y() - kIndicator / 2,
                  kIndicator, kIndicator);
  if (check)
    paintCheckIndicator(box, value, l.flat);
  else
    paintOptionIndicator(box.adjusted(0, 0, -1, -1), value != 0, l.flat);
  const QRect text = right ? l.r.adjusted(0, 0, -kIndicator - 4, 0) : l.r.adjusted(kIndicator + 4, 0, 0, 0);
  paintText(text, Qt::AlignLeft | Qt::AlignVCenter | Qt::TextShowMnemonic | Qt::TextWordWrap, l.caption,
            l.fore, l.enabled);
}

void FormPainter::paintPictureBox(const Look& l) {
  const QRect inner = paintBorder(l.r, edgeOf(l.c, 1), l.back);
  paintPicture(valueOf(l.c, QStringLiteral("Picture")), inner, false);
}

void FormPainter::paintImage(const Look& l) {
  const QVariant picture = valueOf(l.c, QStringLiteral("Picture"));
  const Edge edge = edgeOf(l.c, 0);
  const QRect inner = edge == Edge::None ? l.r : paintBorder(l.r, edge, l.face);
  if (picture.typeId() == QMetaType::QByteArray && !m_pictures.image(picture.toByteArray()).isNull()) {
    paintPicture(picture, inner, valueOf(l.c, QStringLiteral("Stretch"), false).toBool());
  } else if (edge == Edge::None) {
    // An empty image shows its outline at design time.
    m_painter.setPen(QPen(kDarkShadow, 1, Qt::DashLine));
    m_painter.setBrush(Qt::NoBrush);
    m_painter.drawRect(l.r.adjusted(0, 0, -1, -1));
  }
}

void FormPainter::paintTimer(const Look& l) {
  paintRaised(l.r, l.face);
  controlIcon(l.kind).paint(&m_painter, l.r.adjusted(4, 4, -4, -4));
}

void FormPainter::paintScrollBarControl(const Look& l) {
  paintScrollBar(m_painter, l.r, l.kind == QLatin1StringView("HScrollBar") ? Qt::Horizontal : Qt::Vertical);
}

void FormPainter::paintShape(const Look& l) {
  m_painter.setPen(QPen(colorOf(l.c, QStringLiteral("BorderColor"), Qt::black),
                        numberOf(l.c, QStringLiteral("BorderWidth"), 1)));
  m_painter.setBrush(numberOf(l.c, QStringLiteral("BackStyle"), 0) != 0
                         ? QBrush(colorOf(l.c, QStringLiteral("BackColor"), Qt::white))
                         : QBrush(Qt::NoBrush));
  const int shape = static_cast<int>(numberOf(l.c, QStringLiteral("Shape"), 0));
  QRect box = l.r.adjusted(0, 0, -1, -1);
  if (shape == 1 || shape == 3 || shape == 5) {  // the square and circle kinds keep to the smaller side
    const int side = std::min(box.width(), box.height());
    box = QRect(box.center() - QPoint(side / 2, side / 2), QSize(side, side));
  }
  if (shape == 2 || shape == 3)
    m_painter.drawEllipse(box);
  else if (shape == 4 || shape == 5)
    m_painter.drawRoundedRect(box, 6, 6);
  else
    m_painter.drawRect(box);
  m_painter.setBrush(Qt::NoBrush);
}

void FormPainter::paintLine(const Look& l) {
  const QPoint origin = m_geometry.containerOrigin(l.c.liveNode().parent());
  m_painter.setPen(QPen(colorOf(l.c, QStringLiteral("BorderColor"), Qt::black),
                        numberOf(l.c, QStringLiteral("BorderWidth"), 1)));
  m_painter.drawLine(origin + QPoint(pixelsOf(numberOf(l.c, QStringLiteral("X1"), 0)),
                                     pixelsOf(numberOf(l.c, QStringLiteral("Y1"), 0))),
                     origin + QPoint(pixelsOf(numberOf(l.c, QStringLiteral("X2"), 0)),
                                     pixelsOf(numberOf(l.c, QStringLiteral("Y2"), 0))));
}

void FormPainter::paintUserControl(const Look& l, const std::shared_ptr<host::ControlImpl>& userControl) {
  // What the user control's own designer holds, scaled from the size it was designed at to the instance's:
  // its back colour, border and picture, then its constituent controls.
  const Edge edge = edgeOf(*userControl, 0);
  const QRect inner = paintBorder(l.r, edge, colorOf(*userControl, QStringLiteral("BackColor"), l.face));
  paintPicture(valueOf(*userControl, QStringLiteral("Picture")), inner, false);
  auto designer = userControl->form();
  // A user control that holds itself, directly or not, is drawn a few levels deep only.
  constexpr int kDeepest = 4;
  if (designer && l.depth < kDeepest && !designer->description().root().children().empty()) {
    const FormGeometry geometry(designer);
    const QSize designed = geometry.clientSize();
    m_painter.save();
    m_painter.setClipRect(inner, Qt::IntersectClip);
    m_painter.translate(l.r.topLeft());
    if (!designed.isEmpty())
      m_painter.scale(qreal(l.r.width()) / designed.width(), qreal(l.r.height()) / designed.height());
    m_painter.translate(-geometry.clientOrigin());
    FormPainter(m_painter, geometry, m_pictures).paintControls(l.depth + 1);
    m_painter.restore();
  }
  if (edge == Edge::None) {
    // The instance's outline, so that an empty one is still seen at design time.
    m_painter.setPen(QPen(kShadow, 1, Qt::DotLine));
    m_painter.setBrush(Qt::NoBrush);
    m_painter.drawRect(inner.adjusted(0, 0, -1, -1));
  }
}

void FormPainter::paintUnknown(const Look& l) {
  // A control the designer cannot draw (an ActiveX control, a user control whose file is not open): a box
  // with its class and name.
  m_painter.fillRect(l.r, Qt::white);
  m_painter.setPen(kDarkShadow);
  m_painter.drawRect(l.r.adjusted(0, 0, -1, -1));
  m_painter.setFont(vbFont({}));
  m_compatibleMetrics = false;
  paintText(l.r.adjusted(3, 2, -2, -2), Qt::AlignLeft | Qt::AlignTop | Qt::TextWordWrap,
            l.kind + u' ' + l.c.name(), kDarkShadow, true);
}

int FormPainter::alignmentOf(host::ControlImpl& control) {
  switch (static_cast<int>(numberOf(control, QStringLiteral("Alignment"), 0))) {
    case 1:
      return Qt::AlignRight;
    case 2:
      return Qt::AlignHCenter;
    default:
      return Qt::AlignLeft;
  }
}

}  // namespace desktop
