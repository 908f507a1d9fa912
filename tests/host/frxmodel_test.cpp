// SPDX-License-Identifier: MIT
// Values kept in a form's binary file, through the object model: read as texts, lists and pictures, written
// back as the IDE writes them, and every byte that no change touches kept as it was.
#include "host/files/ansi.h"
#include "host/model/designer.h"
#include "host/model/vbe.h"
#include "testproject.h"

#include "printers.h"

#include <gtest/gtest.h>

#include <QDir>
#include <QTemporaryDir>

namespace host {
namespace {

using test::readBytes;
using test::writeBytes;

QByteArray le(quint32 value, int size) {
  QByteArray bytes;
  for (int i = 0; i < size; ++i)
    bytes.append(static_cast<char>(value >> (8 * i)));
  return bytes;
}

QByteArray ansi(const QString& text) {
  return encodeAnsi(text).value_or(QByteArray());
}

const QByteArray kIcon = QByteArray("\0\0\1\0\1\0\x10\x10", 8) + QByteArray(24, '\x11');
const QByteArray kPhoto = QByteArray("BM") + QByteArray(30, '\x22');
const QString kNotes = u"Fotos da loja\r\nTiradas em março"_qs;

/// Fotos.vbp with frmFotos: an icon, a multi-line text, a caption in the short form, a list with its item
/// data and a picture, in the order the description refers to them. A second form refers to a binary file
/// that is missing.
class BinaryValues : public ::testing::Test {
 protected:
  void SetUp() override {
    QByteArray frx;
    const auto offset = [&] { return u"%1"_qs.arg(frx.size(), 4, 16, QLatin1Char('0')).toUpper(); };
    const QString icon = offset();
    frx += le(kIcon.size() + 8, 4) + QByteArray("lt\0\0", 4) + le(kIcon.size(), 4) + kIcon;
    const QString notes = offset();
    frx += le(ansi(kNotes).size(), 4) + ansi(kNotes);
    const QString caption = offset();
    frx += le(6, 1) + ansi(u"Preço:"_qs);
    const QString itemData = offset();
    frx += le(2, 2) + le(2, 2) + le(10, 4) + le(20, 4);
    const QString list = offset();
    frx += le(2, 2) + le(2, 2) + le(4, 2) + "Casa" + le(6, 2) + ansi(u"Jardim"_qs);
    const QString photo = offset();
    frx += le(kPhoto.size() + 8, 4) + QByteArray("lt\0\0", 4) + le(kPhoto.size(), 4) + kPhoto;
    m_frx = frx;
    const QString form = QStringLiteral(
                             "VERSION 5.00\n"
                             "Begin VB.Form frmFotos \n"
                             "   Caption         =   \"Fotos\"\n"
                             "   ClientHeight    =   3000\n"
                             "   ClientWidth     =   4000\n"
                             "   Icon            =   \"frmFotos.frx\":%1\n"
                             "   Begin VB.TextBox txtNotas \n"
                             "      Height          =   900\n"
                             "      Left            =   120\n"
                             "      MultiLine       =   -1  'True\n"
                             "      Text            =   $\"frmFotos.frx\":%2\n"
                             "      Top             =   120\n"
                             "   End\n"
                             "   Begin VB.Label lblPreco \n"
                             "      Caption         =   \"FRMFOTOS.FRX\":%3\n"
                             "   End\n"
                             "   Begin VB.ComboBox cboTipo \n"
                             "      ItemData        =   \"frmFotos.frx\":%4\n"
                             "      List            =   \"frmFotos.frx\":%5\n"
                             "   End\n"
                             "   Begin VB.Image imgFoto \n"
                             "      Picture         =   \"frmFotos.frx\":%6\n"
                             "   End\n"
                             "End\n"
                             "Attribute VB_Name = \"frmFotos\"\n")
                             .arg(icon, notes, caption, itemData, list, photo)
                             .replace(u'\n', u"\r\n"_qs);
    writeBytes(path("frmFotos.frm"), ansi(form));
    writeBytes(path("frmFotos.frx"), m_frx);
    writeBytes(path("frmSem.frm"),
               "VERSION 5.00\r\nBegin VB.Form frmSem \r\n   Icon            =   "
               "\"frmSem.frx\":0000\r\nEnd\r\nAttribute VB_Name = \"frmSem\"\r\n");
    writeBytes(path("Fotos.vbp"), "Type=Exe\r\nForm=frmFotos.frm\r\nForm=FRMSEM.frm\r\nName=\"Fotos\"\r\n");
    m_frm = readBytes(path("frmFotos.frm"));
    open();
  }

  void open() {
    m_vbe = VbeImpl::create();
    m_vbe->open(path("Fotos.vbp"));
    m_form = m_vbe->projects().front()->component(u"frmFotos"_qs);
    ASSERT_TRUE(m_form);
  }
  QString path(const char* name) const { return m_dir.filePath(QString::fromLatin1(name)); }
  QVariant value(const QString& control, const char* property) {
    auto found = m_form->form()->findControl(control);
    return found ? found->property(QString::fromLatin1(property)) : QVariant();
  }

  QTemporaryDir m_dir;
  QByteArray m_frx;
  QByteArray m_frm;
  std::shared_ptr<VbeImpl> m_vbe;
  std::shared_ptr<ComponentImpl> m_form;
};

TEST_F(BinaryValues, ReadAsTextsListsAndPicturesThroughProperties) {
  EXPECT_EQ(m_form->Properties()->Item(u"Icon"_qs)->Value(), QVariant(kIcon));
  auto notes = m_form->Designer()->VBControls()->Item(u"txtNotas"_qs);
  EXPECT_EQ(notes->Properties()->Item(u"Text"_qs)->Value(), QVariant(kNotes));
  EXPECT_EQ(value(u"lblPreco"_qs, "Caption"), QVariant(u"Preço:"_qs));
  EXPECT_EQ(value(u"cboTipo"_qs, "List"), QVariant(QStringList{"Casa", "Jardim"}));
  EXPECT_EQ(value(u"cboTipo"_qs, "ItemData"), QVariant(QVariantList{10, 20}));
  EXPECT_EQ(value(u"imgFoto"_qs, "Picture"), QVariant(kPhoto));
  // Without its binary file a form still opens; its values read as their references.
  auto without = m_vbe->projects().front()->component(u"frmSem"_qs);
  EXPECT_EQ(without->Properties()->Item(u"Icon"_qs)->Value(), QVariant(u"\"frmSem.frx\":0000"_qs));

  // Saved unchanged, and saved with a change outside the binary file: the .frx keeps every byte.
  m_form->save(true);
  EXPECT_EQ(readBytes(path("frmFotos.frm")), m_frm);
  m_form->form()->findControl(u"txtNotas"_qs)->setProperty(u"Left"_qs, 240);
  m_vbe->saveAll();
  EXPECT_EQ(readBytes(path("frmFotos.frx")), m_frx);
  EXPECT_EQ(readBytes(path("frmFotos.frm")),
            QByteArray(m_frm).replace("Left            =   120", "Left            =   240"));
}

TEST_F(BinaryValues, AChangedValueIsWrittenAsTheIdeWritesItAndReadsBackTheSame) {
  auto notes = m_form->form()->findControl(u"txtNotas"_qs);
  const QString changed = u"Fotos novas\r\nda loja"_qs;
  notes->setProperty(u"Text"_qs, changed);
  m_vbe->saveAll();

  // The new record replaces the old at its place; the records after it move by the difference.
  const QByteArray record = le(ansi(changed).size(), 4) + ansi(changed);
  const qsizetype oldStart = 12 + kIcon.size();
  const qsizetype oldLength = 4 + ansi(kNotes).size();
  EXPECT_EQ(readBytes(path("frmFotos.frx")), m_frx.left(oldStart) + record + m_frx.mid(oldStart + oldLength));

  // A list, a picture taken away and a text back on its line; read again from the saved files.
  auto combo = m_form->form()->findControl(u"cboTipo"_qs);
  combo->setProperty(u"List"_qs, QStringList{"Sala", "Cozinha", "Quarto"});
  m_form->form()->findControl(u"imgFoto"_qs)->setProperty(u"Picture"_qs, QByteArray());
  m_form->form()->findControl(u"lblPreco"_qs)->setProperty(u"Caption"_qs, "Valor:");
  m_vbe->saveAll();
  open();
  EXPECT_EQ(value(u"txtNotas"_qs, "Text"), QVariant(changed));
  EXPECT_EQ(value(u"cboTipo"_qs, "List"), QVariant(QStringList{"Sala", "Cozinha", "Quarto"}));
  EXPECT_EQ(value(u"cboTipo"_qs, "ItemData"), QVariant(QVariantList{10, 20}));
  EXPECT_FALSE(value(u"imgFoto"_qs, "Picture").isValid());
  EXPECT_EQ(value(u"lblPreco"_qs, "Caption"), QVariant(u"Valor:"_qs));
  EXPECT_EQ(m_form->Properties()->Item(u"Icon"_qs)->Value(), QVariant(kIcon));
  EXPECT_TRUE(decodeAnsi(readBytes(path("frmFotos.frm"))).contains(u"\"Valor:\""_qs));
}

TEST_F(BinaryValues, SavedUnderANewNameTheFormTakesItsBinaryFileAlong) {
  // As the IDE does: frmFotos2.frm refers to frmFotos2.frx, and the old pair keeps every byte when the new
  // form's values change later.
  m_form->SaveAs(path("frmFotos2.frm"));
  EXPECT_EQ(readBytes(path("frmFotos2.frx")), m_frx);
  const QString saved = decodeAnsi(readBytes(path("frmFotos2.frm")));
  EXPECT_FALSE(saved.contains(u"\"frmFotos.frx\""_qs, Qt::CaseInsensitive));
  EXPECT_EQ(saved.count(u"\"frmFotos2.frx\":"_qs), 6);
  EXPECT_EQ(m_form->FileCount(), 2);
  m_form->form()->findControl(u"cboTipo"_qs)->setProperty(u"List"_qs, QStringList{"Sala"});
  m_vbe->saveAll();
  EXPECT_EQ(readBytes(path("frmFotos.frx")), m_frx);
  EXPECT_EQ(readBytes(path("frmFotos.frm")), m_frm);
  open();  // the project now lists frmFotos2.frm
  EXPECT_EQ(value(u"cboTipo"_qs, "List"), QVariant(QStringList{"Sala"}));
  EXPECT_EQ(m_form->Properties()->Item(u"Icon"_qs)->Value(), QVariant(kIcon));
}

}  // namespace
}  // namespace host
