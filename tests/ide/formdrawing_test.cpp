// SPDX-License-Identifier: MIT
// Forms written for the tests, drawn by the designer and measured on the picture: every common font at
// three sizes (its point size, the room the text takes), user controls from their .ctl, scaled to the
// instance, and a user control whose file is missing. QUIMBEL_TEST_SHOTS=DIR keeps the pictures to look at.
#include "designerview.h"
#include "idefixture.h"
#include "vbfonts.h"

#include <gtest/gtest.h>

#include <QDir>
#include <QFile>
#include <QFontMetrics>
#include <QImage>
#include <QStringDecoder>
#include <QTemporaryDir>

namespace desktop {
namespace {

const QString kCaption = u"Intervalo de regeneração"_qs;

void writeVbFile(const QString& path, const QStringList& lines) {
  QFile file(path);
  ASSERT_TRUE(file.open(QIODevice::WriteOnly));
  file.write(QStringEncoder("Windows-1252")(lines.join(u"\r\n"_qs) + u"\r\n"_qs));
}

QStringList fontBlock(const QString& name, double size) {
  return {u"      BeginProperty Font {0BE35203-8F91-11CE-9DE3-00AA004BB851} "_qs,
          u"         Name            =   \"%1\""_qs.arg(name),
          u"         Size            =   %1"_qs.arg(size),
          u"         Charset         =   0"_qs,
          u"         Weight          =   400"_qs,
          u"      EndProperty"_qs};
}

QStringList header(const QString& kind, const QString& name, int width, int height) {
  return {u"VERSION 5.00"_qs,
          u"Begin %1 %2 "_qs.arg(kind, name),
          u"   ClientHeight    =   %1"_qs.arg(height),
          u"   ClientLeft      =   0"_qs,
          u"   ClientTop       =   0"_qs,
          u"   ClientWidth     =   %1"_qs.arg(width),
          u"   ScaleHeight     =   %1"_qs.arg(height),
          u"   ScaleWidth      =   %1"_qs.arg(width)};
}

QStringList footer(const QString& name) {
  return {u"End"_qs, u"Attribute VB_Name = \"%1\""_qs.arg(name)};
}

QStringList control(const QString& kind, const QString& name, QRect twips, const QStringList& values) {
  QStringList lines{u"   Begin %1 %2 "_qs.arg(kind, name)};
  lines << values;
  lines << u"      Height          =   %1"_qs.arg(twips.height())
        << u"      Left            =   %1"_qs.arg(twips.x())
        << u"      Top             =   %1"_qs.arg(twips.y())
        << u"      Width           =   %1"_qs.arg(twips.width()) << u"   End"_qs;
  return lines;
}

/// The box around the dark pixels (text, borders) of `area`.
QRect inkOf(const QImage& image, const QRect& area) {
  QRect ink;
  for (int y = area.top(); y <= area.bottom(); ++y)
    for (int x = area.left(); x <= area.right(); ++x)
      if (qGray(image.pixel(x, y)) < 140) ink |= QRect(x, y, 1, 1);
  return ink;
}

class FormDrawingTest : public ::testing::Test {
 protected:
  /// Opens the project and draws one of its forms.
  QImage draw(const QString& formName) {
    if (!m_vbe.vbe->project(u"Medidas"_qs)) m_vbe.vbe->open(m_dir.filePath(u"Medidas.vbp"_qs));
    auto component = m_vbe.vbe->project(u"Medidas"_qs)->component(formName);
    EXPECT_TRUE(component && component->form());
    m_canvas = std::make_unique<FormCanvas>(component->form());
    m_canvas->resize(m_canvas->sizeHint());
    QImage image = m_canvas->grab().toImage();
    if (const QString shots = qEnvironmentVariable("QUIMBEL_TEST_SHOTS"); !shots.isEmpty())
      image.save(QDir(shots).filePath(formName + u".png"_qs));
    return image;
  }
  QRect rectOf(const QString& name) const { return m_canvas->rectOf(m_canvas->form()->findControl(name)); }

  QTemporaryDir m_dir;
  test::DesktopVbe m_vbe;
  std::unique_ptr<FormCanvas> m_canvas;
};

struct Face {
  const char* name;
  bool compatible;  // a stand-in with the font's metrics is installed with the IDE
};
const Face kFaces[] = {
    {"MS Sans Serif", false}, {"Microsoft Sans Serif", false}, {"Segoe UI", false},   {"Tahoma", true},
    {"Arial", true},          {"Times New Roman", true},       {"Courier New", true}, {"Verdana", false}};
const double kSizes[] = {8.25, 12, 18};

TEST_F(FormDrawingTest, EveryFontIsDrawnAtItsSizeInTheRoomItsLabelGives) {
  // A label as wide as the text in a compatible stand-in (and a little more); three quarters of that
  // where the stand-in is only close in shape, as a label sized for the narrower original would be.
  QStringList form = header(u"VB.Form"_qs, u"frmFontes"_qs, 9000, 9000);
  std::map<QString, int> natural;
  int top = 120, index = 0;
  for (const Face& face : kFaces) {
    for (const double size : kSizes) {
      const QFontMetrics metrics(vbFont({QString::fromLatin1(face.name), size}));
      const QString name = u"lbl%1"_qs.arg(index++);
      natural[name] = metrics.horizontalAdvance(kCaption);
      const int width = face.compatible ? natural[name] + 8 : natural[name] * 3 / 4;
      const QRect twips(120, top, width * 15, (metrics.height() + 1) * 15);
      form << control(u"VB.Label"_qs, name, twips,
                      QStringList{u"      Caption         =   \"%1\""_qs.arg(kCaption)} +
                          fontBlock(QString::fromLatin1(face.name), size));
      top += twips.height() + 60;
    }
  }
  writeVbFile(m_dir.filePath(u"frmFontes.frm"_qs), form + footer(u"frmFontes"_qs));
  writeVbFile(m_dir.filePath(u"Medidas.vbp"_qs),
              {u"Type=Exe"_qs, u"Form=frmFontes.frm"_qs, u"Name=\"Medidas\""_qs});
  const QImage image = draw(u"frmFontes"_qs);

  index = 0;
  for (const Face& face : kFaces) {
    int previousHeight = 0;
    for (const double size : kSizes) {
      const QString name = u"lbl%1"_qs.arg(index++);
      SCOPED_TRACE(std::string(face.name) + " " + std::to_string(size));
      const QRect label = rectOf(name);
      const QRect ink = inkOf(image, label);
      ASSERT_FALSE(ink.isEmpty());
      // One line, all of it: the text fills the label's width where it had to be narrowed, and takes its
      // own width where the metrics are the font's.
      EXPECT_LE(ink.height(), QFontMetrics(vbFont({QString::fromLatin1(face.name), size})).height());
      if (face.compatible) {
        EXPECT_NEAR(ink.width(), natural[name], 3);
      } else {
        EXPECT_GE(ink.width(), label.width() * 93 / 100);
        EXPECT_LE(ink.right(), label.right());
      }
      // Drawn at its point size: a larger size is taller.
      EXPECT_GT(ink.height(), previousHeight);
      previousHeight = ink.height();
    }
  }
}

TEST_F(FormDrawingTest, AUserControlShowsItsOwnDesignerScaledToTheInstance) {
  QStringList card = header(u"VB.UserControl"_qs, u"ctlCartao"_qs, 2400, 900);
  card.insert(2, u"   BackColor       =   &H00C0FFFF&"_qs);
  card << control(u"VB.TextBox"_qs, u"txtValor"_qs, QRect(1200, 480, 1080, 315),
                  {u"      Text            =   \"123\""_qs})
       << control(u"VB.Label"_qs, u"lblNome"_qs, QRect(120, 120, 1000, 255),
                  {u"      Caption         =   \"Cartão\""_qs});
  writeVbFile(m_dir.filePath(u"ctlCartao.ctl"_qs), card + footer(u"ctlCartao"_qs));
  QStringList form = header(u"VB.Form"_qs, u"frmCartoes"_qs, 6000, 3000);
  form << control(u"Medidas.ctlCartao"_qs, u"ctlGrande"_qs, QRect(120, 120, 4800, 1800), {})
       << control(u"Medidas.ctlFalta"_qs, u"ctlSumido"_qs, QRect(120, 2160, 2400, 600), {});
  writeVbFile(m_dir.filePath(u"frmCartoes.frm"_qs), form + footer(u"frmCartoes"_qs));
  writeVbFile(m_dir.filePath(u"Medidas.vbp"_qs), {u"Type=Exe"_qs, u"Form=frmCartoes.frm"_qs,
                                                  u"UserControl=ctlCartao.ctl"_qs, u"Name=\"Medidas\""_qs});
  const QImage image = draw(u"frmCartoes"_qs);

  // Twice the designed size: what the user control holds is twice as large, at twice its place.
  const QRect instance = rectOf(u"ctlGrande"_qs);
  ASSERT_EQ(instance.size(), QSize(320, 120));
  EXPECT_EQ(QColor(image.pixel(instance.bottomLeft() + QPoint(4, -4))), QColor(0xff, 0xff, 0xc0));
  const QRect textBox(instance.topLeft() + QPoint(160, 64), QSize(144, 42));
  EXPECT_EQ(QColor(image.pixel(textBox.bottomRight() - QPoint(10, 10))), QColor(Qt::white));
  EXPECT_EQ(QColor(image.pixel(textBox.topLeft() + QPoint(-4, 10))), QColor(0xff, 0xff, 0xc0));
  const QRect labelInk = inkOf(image, QRect(instance.topLeft() + QPoint(16, 16), QSize(133, 34)));
  ASSERT_FALSE(labelInk.isEmpty());
  EXPECT_GT(labelInk.height(), QFontMetrics(vbFont({})).ascent()) << "the caption is scaled too";
  // A user control whose file is not in the project: a white box naming its class.
  const QRect missing = rectOf(u"ctlSumido"_qs);
  EXPECT_EQ(QColor(image.pixel(missing.bottomRight() - QPoint(4, 4))), QColor(Qt::white));
  EXPECT_GT(inkOf(image, missing.adjusted(2, 2, -2, -2)).width(), 40);
}

}  // namespace
}  // namespace desktop
