// SPDX-License-Identifier: MIT
#include "formpainter.h"

#include "icons.h"
#include "vbfonts.h"

#include <QPainter>
#include <QPainterPath>

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
  if (!enabled) {
    // Disabled text is etched: white, and grey above it.
    m_painter.setPen(kHighlight);
    m_painter.drawText(area.translated(1, 1), flags, text);
    m_painter.setPen(kShadow);
  } else {
    m_painter.setPen(color);
  }
  m_painter.drawText(area, flags, text);
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

void FormPainter::paintControl(const std::shared_ptr<host::ControlImpl>& control, const QRect& r) {
  host::ControlImpl& c = *control;
  const QString kind = bareClass(c.liveNode().className());
  const QColor face = vbColor(kButtonFace);
  const QColor back = colorOf(c, QStringLiteral("BackColor"), face);
  const QColor fore = colorOf(c, QStringLiteral("ForeColor"), Qt::black);
  const bool enabled = valueOf(c, QStringLiteral("Enabled"), true).toBool();
  const bool flat = numberOf(c, QStringLiteral("Appearance"), 1) == 0;
  const QString caption = textOf(c, QStringLiteral("Caption"));
  m_painter.setFont(vbFont(c.font()));
  const int lineHeight = m_painter.fontMetrics().height();

  if (kind == QLatin1StringView("CommandButton")) {
    QRect inner = r;
    if (valueOf(c, QStringLiteral("Default"), false).toBool()) {
      m_painter.setPen(Qt::black);
      m_painter.drawRect(r.adjusted(0, 0, -1, -1));
      inner = r.adjusted(1, 1, -1, -1);
    }
    if (flat) {
      paintBorder(inner, Edge::Flat, back);
    } else {
      paintRaised(inner, back);
    }
    const QRect area = inner.adjusted(3, 3, -3, -3);
    if (numberOf(c, QStringLiteral("Style"), 0) == 1) {
      const QRect pictureArea = caption.isEmpty() ? area : area.adjusted(0, 0, 0, -lineHeight);
      paintPicture(valueOf(c, QStringLiteral("Picture")), pictureArea, false, true);
      paintText(area, Qt::AlignHCenter | Qt::AlignBottom | Qt::TextShowMnemonic | Qt::TextWordWrap, caption,
                fore, enabled);
    } else {
      paintText(area, Qt::AlignCenter | Qt::TextShowMnemonic | Qt::TextWordWrap, caption, fore, enabled);
    }
  } else if (kind == QLatin1StringView("Label")) {
    if (numberOf(c, QStringLiteral("BackStyle"), 1) != 0) m_painter.fillRect(r, back);
    const Edge edge = edgeOf(c, 0);
    const QRect inner = edge == Edge::None ? r : paintBorder(r, edge, back);
    const int alignment = static_cast<int>(numberOf(c, QStringLiteral("Alignment"), 0));
    const int horizontal = alignment == 1   ? Qt::AlignRight
                           : alignment == 2 ? Qt::AlignHCenter
                                            : Qt::AlignLeft;
    // A label breaks its caption at words unless it sizes itself to one line (AutoSize without WordWrap).
    const bool wrap = !valueOf(c, QStringLiteral("AutoSize"), false).toBool() ||
                      valueOf(c, QStringLiteral("WordWrap"), false).toBool();
    const bool mnemonic = valueOf(c, QStringLiteral("UseMnemonic"), true).toBool();
    paintText(
        inner,
        horizontal | Qt::AlignTop | (wrap ? Qt::TextWordWrap : 0) | (mnemonic ? Qt::TextShowMnemonic : 0),
        caption, fore, enabled);
  } else if (kind == QLatin1StringView("TextBox")) {
    QRect inner = paintBorder(r, edgeOf(c, 1), colorOf(c, QStringLiteral("BackColor"), Qt::white));
    const bool multiLine = valueOf(c, QStringLiteral("MultiLine"), false).toBool();
    const int bars = multiLine ? static_cast<int>(numberOf(c, QStringLiteral("ScrollBars"), 0)) : 0;
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
                         face);
    inner.adjust(1, 1, -(vertical ? kScrollBarWidth : 0), -(horizontal ? kScrollBarWidth : 0));
    QString text = textOf(c, QStringLiteral("Text"));
    const QString password = textOf(c, QStringLiteral("PasswordChar"));
    if (!password.isEmpty() && !multiLine) text = QString(text.size(), password.front());
    if (!multiLine) text = text.section(QStringLiteral("\r\n"), 0, 0);
    text.replace(QStringLiteral("\r\n"), QStringLiteral("\n"));
    const int alignment = static_cast<int>(numberOf(c, QStringLiteral("Alignment"), 0));
    const int horizontalFlag = alignment == 1   ? Qt::AlignRight
                               : alignment == 2 ? Qt::AlignHCenter
                                                : Qt::AlignLeft;
    m_painter.save();
    m_painter.setClipRect(inner, Qt::IntersectClip);
    // A multi-line box without a horizontal scroll bar breaks its lines at words.
    paintText(inner.adjusted(1, 0, -1, 0),
              horizontalFlag | Qt::AlignTop | (multiLine && !horizontal ? Qt::TextWordWrap : 0), text,
              colorOf(c, QStringLiteral("ForeColor"), Qt::black), enabled);
    m_painter.restore();
  } else if (kind == QLatin1StringView("ComboBox") || kind == QLatin1StringView("DriveListBox")) {
    const int style =
        kind == QLatin1StringView("ComboBox") ? static_cast<int>(numberOf(c, QStringLiteral("Style"), 0)) : 0;
    const QColor window = colorOf(c, QStringLiteral("BackColor"), Qt::white);
    const int boxHeight = style == 1 ? std::min(r.height(), lineHeight + 6) : r.height();
    const QRect box(r.topLeft(), QSize(r.width(), boxHeight));
    const QRect inner = paintBorder(box, flat ? Edge::Flat : Edge::Sunken, window);
    QString text = kind == QLatin1StringView("DriveListBox") ? QStringLiteral("c: [ ]")
                   : style == 2                              ? c.name()
                                                             : textOf(c, QStringLiteral("Text"));
    int textRight = inner.right();
    if (style != 1) {
      const QRect button(inner.right() - kScrollBarWidth + 1, inner.top(), kScrollBarWidth, inner.height());
      paintRaised(button, face);
      const QPoint m = button.center();
      m_painter.setPen(Qt::NoPen);
      m_painter.setBrush(Qt::black);
      m_painter.drawPolygon(QPolygon({m + QPoint(-3, -1), m + QPoint(3, -1), m + QPoint(0, 2)}));
      m_painter.setBrush(Qt::NoBrush);
      textRight = button.left() - 1;
    }
    paintText(QRect(inner.left() + 2, inner.top(), textRight - inner.left() - 2, inner.height()),
              Qt::AlignLeft | Qt::AlignVCenter, text, fore, enabled);
    if (style == 1 && r.height() > boxHeight) {
      const QRect list(r.left(), box.bottom() + 1, r.width(), r.height() - boxHeight);
      paintList(paintBorder(list, flat ? Edge::Flat : Edge::Sunken, window), c,
                valueOf(c, QStringLiteral("List")).toStringList(), false);
    }
  } else if (kind == QLatin1StringView("ListBox") || kind == QLatin1StringView("FileListBox") ||
             kind == QLatin1StringView("DirListBox")) {
    const QRect inner =
        paintBorder(r, flat ? Edge::Flat : Edge::Sunken, colorOf(c, QStringLiteral("BackColor"), Qt::white));
    QStringList items = valueOf(c, QStringLiteral("List")).toStringList();
    // An empty list shows its name at design time.
    if (items.isEmpty() && kind == QLatin1StringView("ListBox")) items << c.name();
    if (kind == QLatin1StringView("DirListBox")) items = {QStringLiteral("c:\\")};
    paintList(inner, c, items, numberOf(c, QStringLiteral("Style"), 0) == 1);
  } else if (kind == QLatin1StringView("Frame")) {
    m_painter.fillRect(r, back);
    const int textHeight = lineHeight;
    if (numberOf(c, QStringLiteral("BorderStyle"), 1) != 0) {
      const QRect box = r.adjusted(0, textHeight / 2, -1, -1);
      m_painter.setBrush(Qt::NoBrush);
      if (flat) {
        m_painter.setPen(Qt::black);
        m_painter.drawRect(box);
      } else {
        m_painter.setPen(kShadow);
        m_painter.drawRect(box.adjusted(0, 0, -1, -1));
        m_painter.setPen(kHighlight);
        m_painter.drawRect(box.adjusted(1, 1, 0, 0));
      }
    }
    if (!caption.isEmpty()) {
      const int width = m_painter.fontMetrics().horizontalAdvance(withoutMnemonics(caption)) + 4;
      m_painter.fillRect(QRect(r.left() + 6, r.top(), width, textHeight), back);
      paintText(QRect(r.left() + 8, r.top(), width, textHeight),
                Qt::AlignLeft | Qt::AlignVCenter | Qt::TextShowMnemonic, caption, fore, enabled);
    }
  } else if (kind == QLatin1StringView("CheckBox") || kind == QLatin1StringView("OptionButton")) {
    const bool check = kind == QLatin1StringView("CheckBox");
    const int value = static_cast<int>(check ? numberOf(c, QStringLiteral("Value"), 0)
                                             : (valueOf(c, QStringLiteral("Value"), false).toBool() ? 1 : 0));
    if (numberOf(c, QStringLiteral("Style"), 0) == 1) {  // Graphical: a button, pressed when on
      if (value)
        paintBorder(r, Edge::Sunken, back);
      else
        paintRaised(r, back);
      paintPicture(valueOf(c, QStringLiteral("Picture")), r.adjusted(3, 3, -3, -3 - lineHeight), false, true);
      paintText(r.adjusted(3, 3, -3, -3), Qt::AlignHCenter | Qt::AlignBottom | Qt::TextShowMnemonic, caption,
                fore, enabled);
    } else {
      m_painter.fillRect(r, back);
      const bool right = numberOf(c, QStringLiteral("Alignment"), 0) == 1;
      const QRect box(right ? r.right() - kIndicator + 1 : r.left(), r.center().y() - kIndicator / 2,
                      kIndicator, kIndicator);
      if (check)
        paintCheckIndicator(box, value, flat);
      else
        paintOptionIndicator(box.adjusted(0, 0, -1, -1), value != 0, flat);
      const QRect text = right ? r.adjusted(0, 0, -kIndicator - 4, 0) : r.adjusted(kIndicator + 4, 0, 0, 0);
      paintText(text, Qt::AlignLeft | Qt::AlignVCenter | Qt::TextShowMnemonic | Qt::TextWordWrap, caption,
                fore, enabled);
    }
  } else if (kind == QLatin1StringView("PictureBox")) {
    const QRect inner = paintBorder(r, edgeOf(c, 1), back);
    paintPicture(valueOf(c, QStringLiteral("Picture")), inner, false);
  } else if (kind == QLatin1StringView("Image")) {
    const QVariant picture = valueOf(c, QStringLiteral("Picture"));
    const Edge edge = edgeOf(c, 0);
    const QRect inner = edge == Edge::None ? r : paintBorder(r, edge, face);
    if (picture.typeId() == QMetaType::QByteArray && !m_pictures.image(picture.toByteArray()).isNull()) {
      paintPicture(picture, inner, valueOf(c, QStringLiteral("Stretch"), false).toBool());
    } else if (edge == Edge::None) {
      // An empty image shows its outline at design time.
      m_painter.setPen(QPen(kDarkShadow, 1, Qt::DashLine));
      m_painter.setBrush(Qt::NoBrush);
      m_painter.drawRect(r.adjusted(0, 0, -1, -1));
    }
  } else if (kind == QLatin1StringView("Timer")) {
    paintRaised(r, face);
    controlIcon(kind).paint(&m_painter, r.adjusted(4, 4, -4, -4));
  } else if (kind == QLatin1StringView("HScrollBar") || kind == QLatin1StringView("VScrollBar")) {
    paintScrollBar(m_painter, r, kind == QLatin1StringView("HScrollBar") ? Qt::Horizontal : Qt::Vertical);
  } else if (kind == QLatin1StringView("Shape")) {
    m_painter.setPen(QPen(colorOf(c, QStringLiteral("BorderColor"), Qt::black),
                          numberOf(c, QStringLiteral("BorderWidth"), 1)));
    m_painter.setBrush(numberOf(c, QStringLiteral("BackStyle"), 0) != 0
                           ? QBrush(colorOf(c, QStringLiteral("BackColor"), Qt::white))
                           : QBrush(Qt::NoBrush));
    const int shape = static_cast<int>(numberOf(c, QStringLiteral("Shape"), 0));
    QRect box = r.adjusted(0, 0, -1, -1);
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
  } else if (kind == QLatin1StringView("Line")) {
    const QPoint origin = m_geometry.containerOrigin(c.liveNode().parent());
    m_painter.setPen(QPen(colorOf(c, QStringLiteral("BorderColor"), Qt::black),
                          numberOf(c, QStringLiteral("BorderWidth"), 1)));
    m_painter.drawLine(origin + QPoint(pixelsOf(numberOf(c, QStringLiteral("X1"), 0)),
                                       pixelsOf(numberOf(c, QStringLiteral("Y1"), 0))),
                       origin + QPoint(pixelsOf(numberOf(c, QStringLiteral("X2"), 0)),
                                       pixelsOf(numberOf(c, QStringLiteral("Y2"), 0))));
  } else if (auto userControl = m_geometry.userControlOf(c.liveNode().className())) {
    // A user control of an open project: its own back colour and border, a dotted outline while it has
    // none; what it holds is drawn on top.
    const Edge edge = edgeOf(*userControl, 0);
    const QRect inner = paintBorder(r, edge, colorOf(*userControl, QStringLiteral("BackColor"), face));
    if (edge == Edge::None) {
      m_painter.setPen(QPen(kShadow, 1, Qt::DotLine));
      m_painter.drawRect(inner.adjusted(0, 0, -1, -1));
    }
  } else {
    // A control the designer cannot draw (an ActiveX control): a box with its class and name.
    m_painter.fillRect(r, Qt::white);
    m_painter.setPen(kDarkShadow);
    m_painter.drawRect(r.adjusted(0, 0, -1, -1));
    m_painter.setFont(vbFont({}));
    paintText(r.adjusted(3, 2, -2, -2), Qt::AlignLeft | Qt::AlignTop, kind + u' ' + c.name(), kDarkShadow,
              true);
  }
}

}  // namespace desktop
