// SPDX-License-Identifier: MIT
// Tests of the binary file beside a form: references as the IDE writes them, the records of texts, lists and
// pictures built here byte by byte, records cut short, and rebuilding the file when one value changes.
#include "host/files/frxfile.h"

#include "testtext.h"

#include <gtest/gtest.h>

namespace host {
namespace {

using testing::windowsFile;

QByteArray le(quint32 value, int size) {
  QByteArray bytes;
  for (int i = 0; i < size; ++i)
    bytes.append(static_cast<char>(value >> (8 * i)));
  return bytes;
}

TEST(FrxReferences, ReadAndWrittenAsTheIdeWritesThem) {
  struct Case {
    const char* text;
    bool valid;
    const char* fileName;
    quint32 offset;
    bool longText;
    const char* written;
  };
  const Case cases[] = {
      {R"("frmFotos.frx":0000)", true, "frmFotos.frx", 0, false, R"("frmFotos.frx":0000)"},
      {R"($"FRMFOTOS.FRX":0a3c)", true, "FRMFOTOS.FRX", 0xA3C, true, R"($"FRMFOTOS.FRX":0A3C)"},
      {R"("Form1.frx":10A3C)", true, "Form1.frx", 0x10A3C, false, R"("Form1.frx":10A3C)"},
      {R"("Fotos")", false, "", 0, false, ""},
      {R"("a.frx":)", false, "", 0, false, ""},
      {R"("a.frx":00G0)", false, "", 0, false, ""},
      {"-1  'True", false, "", 0, false, ""},
  };
  for (const Case& c : cases) {
    const auto reference = parseFrxReference(QString::fromLatin1(c.text));
    ASSERT_EQ(reference.has_value(), c.valid) << c.text;
    if (!c.valid) continue;
    EXPECT_EQ(reference->fileName, QLatin1StringView(c.fileName));
    EXPECT_EQ(reference->offset, c.offset);
    EXPECT_EQ(reference->longText, c.longText);
    EXPECT_EQ(formatFrxReference(*reference), QLatin1StringView(c.written));
  }
}

TEST(FrxRecords, TextsListsAndPicturesReadBackFromTheirBytes) {
  const QByteArray notes = windowsFile("Observações:\n1ª linha");
  const QByteArray icon = QByteArray("\0\0\1\0\1\0", 6) + QByteArray(10, 'i');
  QByteArray bytes;
  bytes += le(notes.size(), 4) + notes;                         // 0x00: "$" text
  bytes += le(5, 1) + "Fotos";                                  // 0x1A: short text
  bytes += "\xFF" + le(3, 2) + "Ok!";                           // 0x20: 16-bit length
  bytes += le(2, 2) + le(2, 2) + le(4, 2) + "Casa" + le(0, 2);  // 0x26: two items, one empty
  bytes += le(2, 2) + le(2, 2) + le(7, 4) + le(0xFFFFFFFF, 4);  // 0x32: item data
  bytes += le(icon.size() + 8, 4) + QByteArray("lt\0\0", 4) + le(icon.size(), 4) + icon;  // 0x3E
  const FrxFile file(bytes);

  EXPECT_EQ(file.text({{}, 0x00, true}), u"Observações:\r\n1ª linha"_qs);
  EXPECT_EQ(file.text({{}, 0x1A, false}), u"Fotos"_qs);
  EXPECT_EQ(file.text({{}, 0x20, false}), u"Ok!"_qs);
  EXPECT_EQ(file.list(0x26), (QStringList{u"Casa"_qs, QString()}));
  EXPECT_EQ(file.itemData(0x32), (QList<qint32>{7, -1}));
  EXPECT_EQ(file.picture(0x3E), icon);
  EXPECT_EQ(pictureKind(icon), u"Icon"_qs);
  EXPECT_EQ(file.recordLength({{}, 0x26, false}, FrxRecordKind::List), 12);
  EXPECT_EQ(file.recordLength({{}, 0x3E, false}, FrxRecordKind::Picture), 12 + icon.size());

  // A text record is not a picture; offsets past the end and lengths running off the file read nothing,
  // except a length one byte too long at the very end (the IDE writes such records).
  EXPECT_FALSE(file.picture(0x00));
  EXPECT_FALSE(file.list(bytes.size() + 4));
  EXPECT_FALSE(FrxFile(le(9, 4) + "abc").text({{}, 0, true}));
  EXPECT_EQ(FrxFile(le(4, 1) + "abc").text({{}, 0, false}), u"abc"_qs);
  EXPECT_FALSE(FrxFile(le(3, 2) + le(3, 2) + le(5, 2) + "ab").list(0));
}

TEST(FrxRecords, PicturesAreNamedByTheirFormat) {
  const std::pair<QByteArray, const char*> cases[] = {
      {QByteArray("BM\x36\0\0\0", 6), "Bitmap"},
      {QByteArray("GIF89a"), "Bitmap"},
      {QByteArray("\xFF\xD8\xFF\xE0", 4), "Bitmap"},
      {QByteArray("\0\0\2\0\1\0", 6), "Icon"},
      {QByteArray("\xD7\xCD\xC6\x9A\0\0", 6), "Metafile"},
      {QByteArray("\1\0\x09\0\0\x03", 6), "Metafile"},
      {le(1, 4) + QByteArray(36, '\0') + " EMF" + QByteArray(4, '\0'), "Metafile"},
  };
  for (const auto& [bytes, kind] : cases)
    EXPECT_EQ(pictureKind(bytes), QLatin1StringView(kind)) << bytes.toHex().toStdString();
}

TEST(FrxRecords, EncodedAsTheIdeWritesThem) {
  EXPECT_EQ(encodeFrxText(u"Olá\r\nmundo"), le(10, 4) + windowsFile("Olá\nmundo"));
  EXPECT_FALSE(encodeFrxText(u"\u4E2D"));
  EXPECT_EQ(encodeFrxList({u"A"_qs, u"Bé"_qs}),
            le(2, 2) + le(2, 2) + le(1, 2) + "A" + le(2, 2) + windowsFile("Bé"));
  EXPECT_EQ(encodeFrxList({u"A"_qs}, 7), le(1, 2) + le(7, 2) + le(1, 2) + "A");
  EXPECT_EQ(encodeFrxPicture("GIF"), le(11, 4) + QByteArray("lt\0\0", 4) + le(3, 4) + "GIF");
}

// A form with an icon, a long text and a list; a label whose caption changes goes between them.
constexpr const char* kForm = R"(Begin VB.Form frmFotos 
   Caption         =   "Fotos"
   Icon            =   "frmFotos.frx":0000
   Begin VB.Label lblTitulo 
      Caption         =   "Título"
   End
   Begin VB.TextBox txtNotas 
      Text            =   $"frmFotos.frx":0012
   End
   Begin VB.ComboBox cboTipo 
      List            =   "frmFotos.frx":0019
   End
End
)";

TEST(FrxRebuild, ARecordChangesAndTheOthersKeepTheirBytesInDescriptionOrder) {
  const QByteArray icon = encodeFrxPicture(QByteArray("\0\0\1\0xx", 6));
  const QByteArray text = le(3, 4) + "abc";
  const QByteArray list = le(1, 2) + le(9, 2) + le(1, 2) + "Z";
  const FrxFile old(icon + text + list);
  const std::vector<SourceLine> lines = readSourceLines(windowsFile(kForm), u"frmFotos.frm"_qs);
  std::size_t position = 0;
  FormDescription form = FormDescription::parse(lines, position, u"frmFotos.frm"_qs);
  FormNode& label = *form.root().findNode(u"lblTitulo");

  const auto ends = frxRecordEnds(form.root(), old);
  label.setProperty(u"Caption"_qs, formatFrxReference({u"frmFotos.frx"_qs, 0, true}));
  const QByteArray caption = *encodeFrxText(u"Título\r\nnovo");
  const QByteArray rebuilt =
      rebuildFrx(form.root(), old, ends, u"frmFotos.frx"_qs, &label, u"Caption", caption, u"frmFotos.frx"_qs);

  EXPECT_EQ(rebuilt, icon + caption + text + list);
  EXPECT_EQ(form.root().property(u"Icon"), u"\"frmFotos.frx\":0000"_qs);
  EXPECT_EQ(label.property(u"Caption"), u"$\"frmFotos.frx\":0012"_qs);
  const auto moved = [&](qsizetype offset, bool longText) {
    return formatFrxReference({u"frmFotos.frx"_qs, static_cast<quint32>(offset), longText});
  };
  EXPECT_EQ(form.root().findNode(u"txtNotas")->property(u"Text"), moved(0x12 + caption.size(), true));
  EXPECT_EQ(form.root().findNode(u"cboTipo")->property(u"List"),
            moved(0x12 + caption.size() + text.size(), false));
  EXPECT_EQ(FrxFile(rebuilt).list(0x12 + caption.size() + text.size()), QStringList{u"Z"_qs});

  // A record the file does not hold cannot be carried over.
  const FrxFile cut(icon);
  const auto cutEnds = frxRecordEnds(form.root(), cut);
  const ide::Error error = testing::expectError([&] {
    rebuildFrx(form.root(), cut, cutEnds, u"frmFotos.frx"_qs, nullptr, {}, {}, u"/p/frmFotos.frx"_qs);
  });
  EXPECT_TRUE(error.description().startsWith(u"/p/frmFotos.frx: the value of lblTitulo.Caption"_qs))
      << error.description().toStdString();
}

// Damaged files: a record that another one starts inside, a property written twice. Rebuilt with nothing
// edited, every line keeps its value and every record reads back as before.
TEST(FrxRebuild, DamagedRecordsAndRepeatedLinesKeepTheirValues) {
  const char* form = R"(Begin VB.Form F
   Begin VB.ListBox L
      ItemData        =   "x
      ItemData        =   "F.frx":0000
      List            =   "F.frx":0002 'kept
   End
End
)";
  const FrxFile old(le(1, 2) + le(0, 2) + le(0xDDCCBBAA, 4));  // the list starts inside the item data
  const std::vector<SourceLine> lines = readSourceLines(windowsFile(form), u"F.frm"_qs);
  std::size_t position = 0;
  FormDescription description = FormDescription::parse(lines, position, u"F.frm"_qs);
  FormNode& list = *description.root().findNode(u"L");
  const QByteArray rebuilt = rebuildFrx(description.root(), old, frxRecordEnds(description.root(), old),
                                        u"F.frx"_qs, nullptr, {}, {}, u"F.frx"_qs);

  EXPECT_EQ(rebuilt, old.bytes());  // the list inside the item data stays there
  EXPECT_EQ(FrxFile(rebuilt).itemData(0), QList<qint32>{qint32(0xDDCCBBAA)});
  EXPECT_EQ(FrxFile(rebuilt).list(2), QStringList{});
  EXPECT_EQ(FrxFile(rebuilt).listSecondField(2), 0xBBAA);
  std::vector<SourceLine> written;
  description.appendLines(written);
  EXPECT_EQ(written[2].text, u"      ItemData        =   \"x"_qs);
  EXPECT_EQ(written[3].text, u"      ItemData        =   \"F.frx\":0000"_qs);
  EXPECT_EQ(list.property(u"List"), u"\"F.frx\":0002"_qs);
  EXPECT_EQ(list.propertyComment(u"List"), u"'kept"_qs);
}

}  // namespace
}  // namespace host
