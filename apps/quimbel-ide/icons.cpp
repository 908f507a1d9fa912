// SPDX-License-Identifier: MIT
#include "icons.h"

#include <QBuffer>
#include <QHash>
#include <QPainter>
#include <QPainterPath>
#include <QPixmap>

#include <cmath>

namespace desktop {
namespace {

const QColor kInk(0x3a, 0x3a, 0x3a);
const QColor kPaper(0xff, 0xff, 0xff);
const QColor kBlue(0x2f, 0x6f, 0xbf);
const QColor kDarkBlue(0x1f, 0x3a, 0x78);
const QColor kGreen(0x2f, 0x9a, 0x3e);
const QColor kYellow(0xf0, 0xc8, 0x50);
const QColor kRed(0xc8, 0x3c, 0x3c);
const QColor kGray(0xc8, 0xc8, 0xc8);
const QColor kFace(0xe4, 0xe4, 0xe4);

QPen ink(qreal width = 0.8) {
  return QPen(kInk, width, Qt::SolidLine, Qt::RoundCap, Qt::RoundJoin);
}

void page(QPainter& p, const QRectF& r) {
  QPainterPath path;
  const qreal fold = 3;
  path.moveTo(r.left(), r.top());
  path.lineTo(r.right() - fold, r.top());
  path.lineTo(r.right(), r.top() + fold);
  path.lineTo(r.right(), r.bottom());
  path.lineTo(r.left(), r.bottom());
  path.closeSubpath();
  p.setPen(ink());
  p.setBrush(kPaper);
  p.drawPath(path);
  p.drawLine(QPointF(r.right() - fold, r.top()), QPointF(r.right() - fold, r.top() + fold));
  p.drawLine(QPointF(r.right() - fold, r.top() + fold), QPointF(r.right(), r.top() + fold));
}

void textLines(QPainter& p, const QRectF& r, int count, const QColor& color = kBlue) {
  p.setPen(QPen(color, 0.9, Qt::SolidLine, Qt::FlatCap));
  for (int i = 0; i < count; ++i) {
    const qreal y = r.top() + 2.5 + i * 2.2;
    if (y > r.bottom() - 1) break;
    const qreal right = r.right() - ((i % 3 == 1) ? 3.5 : 1.5);
    p.drawLine(QPointF(r.left() + 1.5 + ((i % 2) ? 1.5 : 0), y), QPointF(right, y));
  }
}

void window(QPainter& p, const QRectF& r, const QColor& body = kPaper) {
  p.setPen(ink());
  p.setBrush(body);
  p.drawRect(r);
  p.setPen(Qt::NoPen);
  p.setBrush(kBlue);
  p.drawRect(QRectF(r.left() + 0.4, r.top() + 0.4, r.width() - 0.8, 2.6));
}

void plusBadge(QPainter& p, QPointF c) {
  p.setPen(QPen(Qt::white, 1.0));
  p.setBrush(kGreen);
  p.drawEllipse(c, 3.4, 3.4);
  p.setPen(QPen(Qt::white, 1.3, Qt::SolidLine, Qt::FlatCap));
  p.drawLine(QPointF(c.x() - 2, c.y()), QPointF(c.x() + 2, c.y()));
  p.drawLine(QPointF(c.x(), c.y() - 2), QPointF(c.x(), c.y() + 2));
}

void folder(QPainter& p, bool open) {
  p.setPen(ink());
  p.setBrush(kYellow.darker(115));
  QPainterPath back;
  back.moveTo(1.5, 3.5);
  back.lineTo(6, 3.5);
  back.lineTo(7.5, 5);
  back.lineTo(14.5, 5);
  back.lineTo(14.5, 13.5);
  back.lineTo(1.5, 13.5);
  back.closeSubpath();
  p.drawPath(back);
  p.setBrush(kYellow);
  if (open) {
    QPolygonF front({QPointF(3.5, 7), QPointF(15.5, 7), QPointF(13.5, 13.5), QPointF(1.5, 13.5)});
    p.drawPolygon(front);
  } else {
    p.drawRect(QRectF(1.5, 6.5, 13, 7));
  }
}

void arrowCurve(QPainter& p, bool left) {
  p.save();
  if (!left) {
    p.translate(16, 0);
    p.scale(-1, 1);
  }
  QPainterPath path;
  path.moveTo(4, 7);
  path.cubicTo(7, 3, 13, 3.5, 13, 9);
  path.cubicTo(13, 11.5, 11.5, 13, 9.5, 13.5);
  p.setPen(QPen(kBlue, 2.0, Qt::SolidLine, Qt::RoundCap));
  p.setBrush(Qt::NoBrush);
  p.drawPath(path);
  p.setPen(Qt::NoPen);
  p.setBrush(kBlue);
  p.drawPolygon(QPolygonF({QPointF(1.5, 8.5), QPointF(6.5, 3.5), QPointF(7, 9.5)}));
  p.restore();
}

void sunPicture(QPainter& p, const QRectF& r) {
  p.setPen(Qt::NoPen);
  p.setBrush(QColor(0xbf, 0xe0, 0xff));
  p.drawRect(r);
  p.setBrush(kYellow);
  p.drawEllipse(QPointF(r.right() - 3, r.top() + 3), 1.6, 1.6);
  p.setBrush(kGreen);
  p.drawPolygon(
      QPolygonF({QPointF(r.left(), r.bottom()), QPointF(r.left() + r.width() * 0.35, r.top() + 4),
                 QPointF(r.left() + r.width() * 0.6, r.bottom() - 2.5),
                 QPointF(r.left() + r.width() * 0.75, r.bottom() - 4.5), QPointF(r.right(), r.bottom())}));
}

void sunken(QPainter& p, const QRectF& r, const QColor& fill = kPaper) {
  p.setPen(ink());
  p.setBrush(fill);
  p.drawRect(r);
}

void draw(QPainter& p, Glyph glyph) {
  switch (glyph) {
    case Glyph::None:
      break;
    case Glyph::NewProject:
      window(p, QRectF(1.5, 2.5, 12, 10));
      p.setPen(QPen(kYellow.darker(130), 1.2, Qt::SolidLine, Qt::RoundCap));
      for (int i = 0; i < 4; ++i) {
        const qreal a = i * M_PI / 4;
        p.drawLine(QPointF(12 + 3 * std::cos(a), 12 + 3 * std::sin(a)),
                   QPointF(12 - 3 * std::cos(a), 12 - 3 * std::sin(a)));
      }
      break;
    case Glyph::AddProject:
      window(p, QRectF(1.5, 1.5, 11, 9));
      window(p, QRectF(3.5, 4.5, 9, 7), kFace);
      plusBadge(p, QPointF(12, 12));
      break;
    case Glyph::AddForm:
      window(p, QRectF(1.5, 1.5, 12, 10), kFace);
      p.setPen(ink(0.6));
      p.setBrush(kPaper);
      p.drawRect(QRectF(3.5, 6, 5, 2.5));
      plusBadge(p, QPointF(12, 12));
      break;
    case Glyph::AddModule:
      page(p, QRectF(2.5, 1.5, 10, 13));
      textLines(p, QRectF(2.5, 2, 10, 12), 5);
      plusBadge(p, QPointF(12, 12));
      break;
    case Glyph::AddClass:
      page(p, QRectF(2.5, 1.5, 10, 13));
      p.setPen(ink(0.6));
      p.setBrush(QColor(0xe8, 0x8a, 0x2e));
      p.drawPolygon(QPolygonF({QPointF(7.5, 4), QPointF(10.5, 7), QPointF(7.5, 10), QPointF(4.5, 7)}));
      plusBadge(p, QPointF(12, 12));
      break;
    case Glyph::Open:
      folder(p, true);
      break;
    case Glyph::Folder:
      folder(p, false);
      break;
    case Glyph::Save:
      p.setPen(ink());
      p.setBrush(kBlue);
      p.drawRoundedRect(QRectF(1.5, 1.5, 13, 13), 1, 1);
      p.setBrush(kPaper);
      p.drawRect(QRectF(4, 1.5, 8, 5.5));
      p.setBrush(kGray);
      p.drawRect(QRectF(4.5, 9.5, 7, 5));
      p.setPen(Qt::NoPen);
      p.setBrush(kInk);
      p.drawRect(QRectF(9, 2.5, 1.6, 3.5));
      break;
    case Glyph::Cut:
      p.setPen(QPen(kInk, 1.2, Qt::SolidLine, Qt::RoundCap));
      p.drawLine(QPointF(5, 1.5), QPointF(10.5, 10));
      p.drawLine(QPointF(11, 1.5), QPointF(5.5, 10));
      p.setPen(QPen(kRed, 1.4));
      p.setBrush(Qt::NoBrush);
      p.drawEllipse(QPointF(4.5, 12), 2.3, 2.3);
      p.drawEllipse(QPointF(11.5, 12), 2.3, 2.3);
      break;
    case Glyph::Copy:
      page(p, QRectF(1.5, 1.5, 8.5, 10));
      textLines(p, QRectF(1.5, 1.5, 8.5, 10), 3, kGray.darker(130));
      page(p, QRectF(6, 5, 8.5, 10));
      textLines(p, QRectF(6, 5, 8.5, 10), 4);
      break;
    case Glyph::Paste:
      p.setPen(ink());
      p.setBrush(QColor(0xb0, 0x80, 0x48));
      p.drawRoundedRect(QRectF(1.5, 2.5, 10, 12), 1, 1);
      p.setBrush(kGray);
      p.drawRect(QRectF(4, 1.5, 5, 2.5));
      page(p, QRectF(7, 6, 7.5, 9));
      textLines(p, QRectF(7, 6, 7.5, 9), 3);
      break;
    case Glyph::Find:
      p.setPen(QPen(kInk, 1.4));
      p.setBrush(QColor(0xd8, 0xec, 0xff));
      p.drawEllipse(QPointF(6.5, 6.5), 4.3, 4.3);
      p.setPen(QPen(QColor(0x70, 0x50, 0x30), 2.6, Qt::SolidLine, Qt::RoundCap));
      p.drawLine(QPointF(10, 10), QPointF(14, 14));
      break;
    case Glyph::Undo:
      arrowCurve(p, true);
      break;
    case Glyph::Redo:
      arrowCurve(p, false);
      break;
    case Glyph::Start:
      p.setPen(QPen(kGreen.darker(140), 0.8, Qt::SolidLine, Qt::RoundCap, Qt::RoundJoin));
      p.setBrush(kGreen);
      p.drawPolygon(QPolygonF({QPointF(4, 2), QPointF(13.5, 8), QPointF(4, 14)}));
      break;
    case Glyph::Break:
      p.setPen(ink(0.6));
      p.setBrush(kBlue);
      p.drawRect(QRectF(3.5, 2.5, 3, 11));
      p.drawRect(QRectF(9.5, 2.5, 3, 11));
      break;
    case Glyph::End:
      p.setPen(ink(0.6));
      p.setBrush(kDarkBlue);
      p.drawRect(QRectF(3, 3, 10, 10));
      break;
    case Glyph::ProjectExplorer:
      p.setPen(ink(0.8));
      p.drawLine(QPointF(4, 5), QPointF(4, 13));
      p.drawLine(QPointF(4, 8.5), QPointF(8, 8.5));
      p.drawLine(QPointF(4, 13), QPointF(8, 13));
      window(p, QRectF(1.5, 1.5, 6, 4.5));
      p.setBrush(kYellow);
      p.setPen(ink(0.6));
      p.drawRect(QRectF(8, 7, 6.5, 3));
      p.setBrush(kPaper);
      p.drawRect(QRectF(8, 11.5, 6.5, 3));
      break;
    case Glyph::Properties:
      window(p, QRectF(1.5, 1.5, 13, 13));
      p.setPen(ink(0.5));
      for (int i = 0; i < 4; ++i)
        p.drawLine(QPointF(2, 6.5 + i * 2.3), QPointF(14, 6.5 + i * 2.3));
      p.drawLine(QPointF(7, 4.2), QPointF(7, 14.5));
      break;
    case Glyph::Toolbox:
      p.setPen(ink());
      p.setBrush(kRed);
      p.drawRect(QRectF(1.5, 6.5, 13, 8));
      p.setBrush(Qt::NoBrush);
      p.drawRoundedRect(QRectF(5, 3.5, 6, 3), 1, 1);
      p.setPen(QPen(kRed.darker(140), 1.0));
      p.drawLine(QPointF(1.5, 9.5), QPointF(14.5, 9.5));
      p.setPen(ink());
      p.setBrush(kGray);
      p.drawRect(QRectF(7, 8.5, 2, 2.5));
      break;
    case Glyph::Remove:
      page(p, QRectF(2.5, 1.5, 10, 13));
      p.setPen(QPen(kRed, 2.0, Qt::SolidLine, Qt::RoundCap));
      p.drawLine(QPointF(9, 9), QPointF(14, 14));
      p.drawLine(QPointF(14, 9), QPointF(9, 14));
      break;
    case Glyph::AddIns: {
      p.setPen(ink());
      p.setBrush(kGray);
      QPainterPath gear;
      const int teeth = 8;
      for (int i = 0; i < teeth * 2; ++i) {
        const qreal a = i * M_PI / teeth;
        const qreal r = (i % 2) ? 5.0 : 6.7;
        const QPointF point(8 + r * std::cos(a), 8 + r * std::sin(a));
        i == 0 ? gear.moveTo(point) : gear.lineTo(point);
      }
      gear.closeSubpath();
      gear.addEllipse(QPointF(8, 8), 2, 2);
      gear.setFillRule(Qt::OddEvenFill);
      p.drawPath(gear);
      break;
    }
    case Glyph::Exit:
      p.setPen(ink());
      p.setBrush(QColor(0xb0, 0x80, 0x48));
      p.drawRect(QRectF(2.5, 1.5, 7, 13));
      p.setPen(QPen(kRed, 1.8, Qt::SolidLine, Qt::RoundCap));
      p.drawLine(QPointF(8, 8), QPointF(14.5, 8));
      p.drawLine(QPointF(12, 5.5), QPointF(14.5, 8));
      p.drawLine(QPointF(12, 10.5), QPointF(14.5, 8));
      break;
    case Glyph::ViewCode:
    case Glyph::Module:
      page(p, QRectF(2.5, 1.5, 11, 13));
      textLines(p, QRectF(2.5, 2, 11, 12), 5);
      if (glyph == Glyph::Module) {
        p.setPen(Qt::NoPen);
        p.setBrush(kGreen);
        p.drawRect(QRectF(3.5, 10.5, 4, 3));
      }
      break;
    case Glyph::ClassModule:
      page(p, QRectF(2.5, 1.5, 11, 13));
      textLines(p, QRectF(2.5, 2, 11, 12), 2);
      p.setPen(ink(0.6));
      p.setBrush(QColor(0xe8, 0x8a, 0x2e));
      p.drawPolygon(QPolygonF({QPointF(8, 7), QPointF(11, 10), QPointF(8, 13), QPointF(5, 10)}));
      break;
    case Glyph::ViewObject:
    case Glyph::Form:
      window(p, QRectF(1.5, 2.5, 13, 11), kFace);
      p.setPen(ink(0.5));
      p.setBrush(kPaper);
      p.drawRect(QRectF(3.5, 7, 6, 2.2));
      p.setBrush(kGray);
      p.drawRect(QRectF(10.5, 10, 3, 2));
      break;
    case Glyph::Project:
      window(p, QRectF(1.5, 1.5, 11, 9), kFace);
      window(p, QRectF(4.5, 5.5, 10, 9), kPaper);
      textLines(p, QRectF(4.5, 8, 10, 6), 2);
      break;
    case Glyph::Document:
      page(p, QRectF(3, 1.5, 10, 13));
      textLines(p, QRectF(3, 2, 10, 12), 4, kGray.darker(140));
      break;
    case Glyph::About:
      p.setPen(QPen(kDarkBlue, 0.8));
      p.setBrush(kBlue);
      p.drawEllipse(QPointF(8, 8), 6.5, 6.5);
      p.setPen(QPen(Qt::white, 1.8, Qt::SolidLine, Qt::RoundCap));
      p.drawLine(QPointF(8, 7.5), QPointF(8, 11.5));
      p.drawPoint(QPointF(8, 4.8));
      break;
    case Glyph::Pointer:
      p.setPen(ink(0.8));
      p.setBrush(kPaper);
      p.drawPolygon(QPolygonF({QPointF(4, 1.5), QPointF(4, 13), QPointF(6.8, 10.5), QPointF(9, 14.5),
                               QPointF(10.7, 13.7), QPointF(8.6, 9.8), QPointF(12, 9.5)}));
      break;
    case Glyph::PictureBox:
      sunken(p, QRectF(1.5, 2.5, 13, 11), kFace);
      sunPicture(p, QRectF(3, 4, 10, 8));
      break;
    case Glyph::Image:
      p.setPen(QPen(kInk, 0.6, Qt::DashLine));
      p.setBrush(Qt::NoBrush);
      p.drawRect(QRectF(1.5, 2.5, 13, 11));
      sunPicture(p, QRectF(2.5, 3.5, 11, 9));
      break;
    case Glyph::Label: {
      QFont font(QStringLiteral("DejaVu Serif"));
      font.setPixelSize(13);
      font.setBold(true);
      p.setFont(font);
      p.setPen(kDarkBlue);
      p.drawText(QRectF(0, 0, 16, 16), Qt::AlignCenter, QStringLiteral("A"));
      break;
    }
    case Glyph::TextBox: {
      sunken(p, QRectF(1.5, 3.5, 13, 9));
      QFont font(QStringLiteral("DejaVu Sans"));
      font.setPixelSize(7);
      p.setFont(font);
      p.setPen(kInk);
      p.drawText(QRectF(2.5, 3.5, 10, 9), Qt::AlignLeft | Qt::AlignVCenter, QStringLiteral("ab"));
      p.setPen(ink(0.7));
      p.drawLine(QPointF(11, 5.5), QPointF(11, 10.5));
      break;
    }
    case Glyph::Frame: {
      p.setPen(ink(0.7));
      p.setBrush(Qt::NoBrush);
      p.drawRect(QRectF(1.5, 4.5, 13, 10));
      p.setPen(Qt::NoPen);
      p.setBrush(QColor(0xf0, 0xf0, 0xf0));
      p.drawRect(QRectF(3, 2.5, 7, 4));
      QFont font(QStringLiteral("DejaVu Sans"));
      font.setPixelSize(6);
      p.setFont(font);
      p.setPen(kInk);
      p.drawText(QRectF(3, 1.5, 7, 6), Qt::AlignCenter, QStringLiteral("xy"));
      break;
    }
    case Glyph::CommandButton:
      p.setPen(ink(0.7));
      p.setBrush(kFace);
      p.drawRoundedRect(QRectF(1.5, 4, 13, 8), 1.2, 1.2);
      p.setPen(QPen(Qt::white, 0.8));
      p.drawLine(QPointF(2.5, 5), QPointF(13.5, 5));
      p.setPen(QPen(kGray.darker(120), 0.8));
      p.drawLine(QPointF(2.5, 11), QPointF(13.5, 11));
      break;
    case Glyph::CheckBox:
      sunken(p, QRectF(2.5, 2.5, 11, 11));
      p.setPen(QPen(kGreen.darker(120), 1.8, Qt::SolidLine, Qt::RoundCap, Qt::RoundJoin));
      p.drawPolyline(QPolygonF({QPointF(4.5, 8), QPointF(7, 10.5), QPointF(11.5, 5)}));
      break;
    case Glyph::OptionButton:
      p.setPen(ink());
      p.setBrush(kPaper);
      p.drawEllipse(QPointF(8, 8), 5.5, 5.5);
      p.setPen(Qt::NoPen);
      p.setBrush(kInk);
      p.drawEllipse(QPointF(8, 8), 2.2, 2.2);
      break;
    case Glyph::ComboBox:
      sunken(p, QRectF(1.5, 4.5, 13, 7));
      p.setPen(ink(0.6));
      p.setBrush(kFace);
      p.drawRect(QRectF(9.5, 4.5, 5, 7));
      p.setPen(Qt::NoPen);
      p.setBrush(kInk);
      p.drawPolygon(QPolygonF({QPointF(10.5, 7), QPointF(13.5, 7), QPointF(12, 9)}));
      break;
    case Glyph::ListBox:
      sunken(p, QRectF(1.5, 1.5, 13, 13));
      textLines(p, QRectF(1.5, 1.5, 9.5, 13), 5, kInk);
      p.setPen(ink(0.6));
      p.setBrush(kFace);
      p.drawRect(QRectF(11, 1.5, 3.5, 13));
      break;
    case Glyph::HScrollBar:
      p.setPen(ink(0.6));
      p.setBrush(kFace);
      p.drawRect(QRectF(1, 5, 14, 6));
      p.drawRect(QRectF(1, 5, 3.5, 6));
      p.drawRect(QRectF(11.5, 5, 3.5, 6));
      p.setBrush(kGray);
      p.drawRect(QRectF(6, 5, 3.5, 6));
      break;
    case Glyph::VScrollBar:
      p.setPen(ink(0.6));
      p.setBrush(kFace);
      p.drawRect(QRectF(5, 1, 6, 14));
      p.drawRect(QRectF(5, 1, 6, 3.5));
      p.drawRect(QRectF(5, 11.5, 6, 3.5));
      p.setBrush(kGray);
      p.drawRect(QRectF(5, 6, 6, 3.5));
      break;
    case Glyph::Timer:
      p.setPen(ink());
      p.setBrush(kPaper);
      p.drawEllipse(QPointF(8, 9), 5.5, 5.5);
      p.setBrush(kGray);
      p.drawRect(QRectF(6.5, 1.5, 3, 2));
      p.setPen(QPen(kRed, 1.2, Qt::SolidLine, Qt::RoundCap));
      p.drawLine(QPointF(8, 9), QPointF(8, 5.5));
      p.drawLine(QPointF(8, 9), QPointF(10.5, 10.5));
      break;
    case Glyph::DriveListBox:
      p.setPen(ink());
      p.setBrush(kGray);
      p.drawRect(QRectF(1.5, 5.5, 13, 6));
      p.setPen(Qt::NoPen);
      p.setBrush(kGreen);
      p.drawRect(QRectF(11, 9, 2, 1.2));
      p.setBrush(kInk);
      p.drawRect(QRectF(3, 7.5, 6, 1));
      break;
    case Glyph::DirListBox:
      folder(p, false);
      p.setPen(ink(0.6));
      p.drawLine(QPointF(4, 9), QPointF(4, 12));
      p.drawLine(QPointF(4, 12), QPointF(8, 12));
      break;
    case Glyph::FileListBox:
      page(p, QRectF(1.5, 1.5, 8, 10));
      page(p, QRectF(6.5, 4.5, 8, 10));
      textLines(p, QRectF(6.5, 4.5, 8, 10), 3);
      break;
    case Glyph::Shape:
      p.setPen(ink());
      p.setBrush(kYellow);
      p.drawRect(QRectF(1.5, 1.5, 7, 7));
      p.setBrush(kBlue);
      p.drawEllipse(QPointF(10.5, 10.5), 4, 4);
      break;
    case Glyph::Line:
      p.setPen(QPen(kInk, 1.4, Qt::SolidLine, Qt::RoundCap));
      p.drawLine(QPointF(2, 14), QPointF(14, 2));
      break;
  }
}

QPixmap render(Glyph glyph, int size) {
  QPixmap pixmap(size, size);
  pixmap.fill(Qt::transparent);
  QPainter painter(&pixmap);
  painter.setRenderHint(QPainter::Antialiasing);
  painter.setRenderHint(QPainter::TextAntialiasing);
  painter.scale(size / 16.0, size / 16.0);
  draw(painter, glyph);
  return pixmap;
}

}  // namespace

QIcon icon(Glyph glyph) {
  if (glyph == Glyph::None) return {};
  static QHash<int, QIcon> cache;
  auto it = cache.find(static_cast<int>(glyph));
  if (it != cache.end()) return *it;
  QIcon result;
  for (const int size : {16, 20, 24, 32, 48})
    result.addPixmap(render(glyph, size));
  cache.insert(static_cast<int>(glyph), result);
  return result;
}

QByteArray glyphPng(Glyph glyph, int size) {
  QByteArray bytes;
  QBuffer buffer(&bytes);
  buffer.open(QIODevice::WriteOnly);
  render(glyph, size).save(&buffer, "PNG");
  return bytes;
}

QIcon commandIcon(host::BuiltinCommand command) {
  using B = host::BuiltinCommand;
  switch (command) {
    case B::NewProject:
      return icon(Glyph::NewProject);
    case B::OpenProject:
      return icon(Glyph::Open);
    case B::AddProject:
      return icon(Glyph::AddProject);
    case B::RemoveProject:
    case B::RemoveComponent:
      return icon(Glyph::Remove);
    case B::SaveProject:
    case B::SaveFile:
      return icon(Glyph::Save);
    case B::Exit:
      return icon(Glyph::Exit);
    case B::Undo:
      return icon(Glyph::Undo);
    case B::Redo:
      return icon(Glyph::Redo);
    case B::Cut:
      return icon(Glyph::Cut);
    case B::Copy:
      return icon(Glyph::Copy);
    case B::Paste:
      return icon(Glyph::Paste);
    case B::Find:
      return icon(Glyph::Find);
    case B::AddForm:
      return icon(Glyph::AddForm);
    case B::AddModule:
      return icon(Glyph::AddModule);
    case B::AddClass:
      return icon(Glyph::AddClass);
    case B::ViewCode:
      return icon(Glyph::ViewCode);
    case B::ViewObject:
      return icon(Glyph::ViewObject);
    case B::ViewProjectExplorer:
      return icon(Glyph::ProjectExplorer);
    case B::ViewProperties:
      return icon(Glyph::Properties);
    case B::ViewToolbox:
      return icon(Glyph::Toolbox);
    case B::Start:
    case B::Continue:
      return icon(Glyph::Start);
    case B::Break:
      return icon(Glyph::Break);
    case B::End:
      return icon(Glyph::End);
    case B::AddInManager:
      return icon(Glyph::AddIns);
    case B::About:
      return icon(Glyph::About);
    default:
      return {};
  }
}

QIcon componentIcon(ide::ComponentType type) {
  switch (type) {
    case ide::ComponentType::StdModule:
      return icon(Glyph::Module);
    case ide::ComponentType::ClassModule:
      return icon(Glyph::ClassModule);
    case ide::ComponentType::VBForm:
    case ide::ComponentType::VBMDIForm:
    case ide::ComponentType::UserControl:
    case ide::ComponentType::PropPage:
    case ide::ComponentType::DocObject:
      return icon(Glyph::Form);
    default:
      return icon(Glyph::Document);
  }
}

QIcon controlIcon(const QString& className) {
  static const QHash<QString, Glyph> glyphs = {
      {QStringLiteral("PictureBox"), Glyph::PictureBox},
      {QStringLiteral("Label"), Glyph::Label},
      {QStringLiteral("TextBox"), Glyph::TextBox},
      {QStringLiteral("Frame"), Glyph::Frame},
      {QStringLiteral("CommandButton"), Glyph::CommandButton},
      {QStringLiteral("CheckBox"), Glyph::CheckBox},
      {QStringLiteral("OptionButton"), Glyph::OptionButton},
      {QStringLiteral("ComboBox"), Glyph::ComboBox},
      {QStringLiteral("ListBox"), Glyph::ListBox},
      {QStringLiteral("HScrollBar"), Glyph::HScrollBar},
      {QStringLiteral("VScrollBar"), Glyph::VScrollBar},
      {QStringLiteral("Timer"), Glyph::Timer},
      {QStringLiteral("DriveListBox"), Glyph::DriveListBox},
      {QStringLiteral("DirListBox"), Glyph::DirListBox},
      {QStringLiteral("FileListBox"), Glyph::FileListBox},
      {QStringLiteral("Shape"), Glyph::Shape},
      {QStringLiteral("Line"), Glyph::Line},
      {QStringLiteral("Image"), Glyph::Image},
      {QStringLiteral("Pointer"), Glyph::Pointer},
  };
  QString bare = className;
  if (bare.startsWith(QLatin1StringView("VB."), Qt::CaseInsensitive)) bare = bare.sliced(3);
  return icon(glyphs.value(bare, Glyph::Document));
}

}  // namespace desktop
