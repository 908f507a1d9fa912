// SPDX-License-Identifier: MIT
// The binary file beside a form description (.frx; .ctx, .pgx, .dox, .dsx for the other designers): the
// values a property line refers to by byte offset ("Form1.frx":0000) instead of holding them. The file has
// no header; its records lie back to back, each laid out by the kind of property that refers to it. Texts
// are Windows-1252, numbers little-endian.
#pragma once

#include "host/files/formdescription.h"

#include <QByteArray>
#include <QByteArrayView>
#include <QList>
#include <QString>
#include <QStringList>
#include <QStringView>

#include <map>
#include <optional>
#include <utility>
#include <vector>

namespace host {

/// A property value that refers to the binary file: `"Form1.frx":0442`, or `$"Form1.frx":0442` for a text
/// whose record starts with a 32-bit length.
struct FrxReference {
  QString fileName;
  quint32 offset = 0;
  bool longText = false;  // the "$" form
};

/// The reference a value text makes, or nothing when it holds its value itself.
std::optional<FrxReference> parseFrxReference(QStringView valueText);
/// As the IDE writes it: the offset in at least four upper-case hexadecimal digits.
QString formatFrxReference(const FrxReference& reference);

/// How the record of a property is laid out.
enum class FrxRecordKind {
  Text,      // "$": 32-bit length; otherwise 8-bit length, 0xFF for a 16-bit one (0xFFFF: a 32-bit one)
  List,      // 16-bit count, a 16-bit field, then per item a 16-bit length and the text
  ItemData,  // 16-bit count, a 16-bit field, then a 32-bit number per item
  Picture,   // 32-bit size (data + 8), "lt\0\0", 32-bit data size, then the picture file itself
  Other,     // an ActiveX control's own data: the bytes up to the next record
};

/// The layout of a property's record: texts for String properties (and "$" references), lists for List and
/// ItemData, pictures for the picture properties (Picture, Icon, MouseIcon, DragIcon ...).
FrxRecordKind frxRecordKind(QStringView className, QStringView propertyName, bool longText = false);

/// What a picture holds, as the properties window names it: "Icon" (icons and cursors), "Metafile" (WMF
/// and EMF) or "Bitmap" (everything else: BMP, GIF, JPEG ...).
QString pictureKind(QByteArrayView picture);

/// The records of a text, a list and a picture as the IDE writes them. A text is always written in the
/// "$" form. Nothing when a character has no Windows-1252 byte, or a length does not fit its field.
std::optional<QByteArray> encodeFrxText(QStringView text);
std::optional<QByteArray> encodeFrxList(const QStringList& items, std::optional<quint16> secondField = {});
QByteArray encodeFrxPicture(QByteArrayView picture);

/// The bytes of a binary file and the values of its records.
class FrxFile {
 public:
  FrxFile() = default;
  explicit FrxFile(QByteArray bytes) : m_bytes(std::move(bytes)) {}

  const QByteArray& bytes() const { return m_bytes; }
  bool isEmpty() const { return m_bytes.isEmpty(); }

  /// The values of records, or nothing when the record does not fit in the file. A length that runs one
  /// byte past the end of the file is taken one shorter: the IDE has been seen to write such records.
  std::optional<QString> text(const FrxReference& reference) const;
  std::optional<QStringList> list(quint32 offset) const;
  std::optional<QList<qint32>> itemData(quint32 offset) const;
  std::optional<QByteArray> picture(quint32 offset) const;
  /// The 16-bit field after a list's count (kept when the list is written again).
  std::optional<quint16> listSecondField(quint32 offset) const;

  /// The record's length as its own header gives it; nothing for Other records or when it does not fit.
  std::optional<qsizetype> recordLength(const FrxReference& reference, FrxRecordKind kind) const;
  /// The length its header gives runs past the end of the file (a record cut short, the IDE's one byte
  /// short, a header that does not fit): the record reads as it does only where the file ends.
  bool readsPastEnd(const FrxReference& reference, FrxRecordKind kind) const;

 private:
  /// Where a text's bytes start and how many there are, as its length field says.
  std::optional<std::pair<qsizetype, qsizetype>> textBounds(const FrxReference& reference) const;
  std::optional<qsizetype> headerLength(const FrxReference& reference, FrxRecordKind kind) const;
  std::optional<quint32> number(qsizetype at, int size) const;
  /// `length` bytes at `at`, or one fewer when exactly one is missing at the end of the file.
  std::optional<QByteArrayView> span(qsizetype at, qsizetype length) const;

  QByteArray m_bytes;
};

/// A property line that refers to the binary file, in the order of the description.
struct FrxProperty {
  PropertyGroup* group;  // the control's block or a property block inside it
  FormNode* owner;       // the control it belongs to
  QString name;
  FrxReference reference;
  /// How many lines of the same name stand above it in its group (a damaged file may repeat one).
  int occurrence = 0;
};

/// Every property line of the description that refers to a binary file, in file order.
std::vector<FrxProperty> frxProperties(FormNode& root);

/// Where each record of `file` that the description refers to ends, by its offset: at the end its own header
/// gives, at the end of the file for one that reads past it, or (for records whose layout is not known) at
/// the next record or the end of the file.
std::map<quint32, qsizetype> frxRecordEnds(FormNode& root, const FrxFile& file);

/// The binary file as the IDE writes it after a value in it changed: the records the description refers to,
/// in its order, back to back from offset 0, and each reference rewritten to `fileName` and its new offset.
/// Records that share bytes in a damaged file are written together once, and those that read up to the end
/// of the file last, so that every record reads back as it did.
/// The line of `changedName` in `changedGroup` gets `changedRecord`; every other record keeps its bytes
/// (`ends` tells where they end, as frxRecordEnds gave it before the change). Throws ide::Error 321 naming
/// `displayName` when a record the description refers to is not in the file.
QByteArray rebuildFrx(FormNode& root, const FrxFile& old, const std::map<quint32, qsizetype>& ends,
                      const QString& fileName, const PropertyGroup* changedGroup, QStringView changedName,
                      const QByteArray& changedRecord, const QString& displayName);

}  // namespace host
