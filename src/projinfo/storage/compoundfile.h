// SPDX-License-Identifier: MIT
// Compound files (the structured-storage format: storages that hold streams and further storages inside
// one file) held whole in memory. readCompoundFile parses a file's bytes into a tree of elements and
// checks every sector chain, index and size on the way, so that a damaged or truncated file is refused
// with a reason instead of being half read; writeCompoundFile lays a tree out anew as a version 3 file
// (512-byte sectors, streams under 4096 bytes in the mini stream, every storage's children in a balanced
// red-black tree). Libraries that read such files go through their directory entry by entry in linear
// lists, which is far too slow for a storage with ten thousand streams; this reader and writer take
// linear time.
#pragma once

#include <QByteArray>
#include <QString>
#include <QUuid>

#include <map>
#include <memory>

namespace projinfo {

/// Failure codes of the structured-storage platform (32-bit, as signed numbers).
namespace stg {
inline constexpr long FileNotFound = static_cast<qint32>(0x80030002u);
inline constexpr long PathNotFound = static_cast<qint32>(0x80030003u);
inline constexpr long AccessDenied = static_cast<qint32>(0x80030005u);
inline constexpr long InvalidHandle = static_cast<qint32>(0x80030006u);
inline constexpr long InvalidFunction = static_cast<qint32>(0x80030001u);
inline constexpr long WriteFault = static_cast<qint32>(0x8003001Du);
inline constexpr long ReadFault = static_cast<qint32>(0x8003001Eu);
inline constexpr long ShareViolation = static_cast<qint32>(0x80030020u);
inline constexpr long LockViolation = static_cast<qint32>(0x80030021u);
inline constexpr long FileAlreadyExists = static_cast<qint32>(0x80030050u);
inline constexpr long InvalidParameter = static_cast<qint32>(0x80030057u);
inline constexpr long Reverted = static_cast<qint32>(0x80030102u);
inline constexpr long InvalidHeader = static_cast<qint32>(0x800300FBu);
inline constexpr long InvalidName = static_cast<qint32>(0x800300FCu);
inline constexpr long DocFileCorrupt = static_cast<qint32>(0x80030109u);
inline constexpr long NoInterface = static_cast<qint32>(0x80004002u);
/// The run time's own number for an element that exists already.
inline constexpr long ElementExists = 58;
}  // namespace stg

enum class ElementKind : quint8 { Storage = 1, Stream = 2, Root = 5 };

struct Element;

/// A child's key: its name upper-cased. Names compare as the format orders them (shorter first, then code
/// unit by code unit), which also makes lookups ignore letter case.
struct ElementKey {
  QString upper;
  explicit ElementKey(const QString& name) : upper(name.toUpper()) {}
  friend bool operator<(const ElementKey& a, const ElementKey& b) {
    if (a.upper.size() != b.upper.size()) return a.upper.size() < b.upper.size();
    return QStringView(a.upper).compare(QStringView(b.upper)) < 0;
  }
};

using ElementMap = std::map<ElementKey, std::shared_ptr<Element>>;

/// One element of a compound file: a storage (or the root) with its children, or a stream with its bytes.
struct Element {
  Element() = default;
  Element(const Element&) = default;
  Element(Element&&) = default;
  Element& operator=(const Element&) = default;
  Element& operator=(Element&&) = default;
  /// Takes the tree below apart level by level: a damaged file's tree may be as deep as it is long.
  ~Element();

  QString name;
  ElementKind kind = ElementKind::Stream;
  QUuid clsid;
  quint32 stateBits = 0;
  /// Times as the format keeps them (100-nanosecond steps since 1601); 0 when not set.
  quint64 created = 0;
  quint64 modified = 0;
  QByteArray data;
  ElementMap children;
  /// Destroyed, or dropped by a revert: whoever still holds the element may no longer use it.
  bool gone = false;

  bool isStorage() const { return kind != ElementKind::Stream; }
};

/// How many storages may nest inside each other (the root's children are at depth 1). The format sets no
/// limit, but nothing real comes near it: deeper trees are damage, refused on reading and on writing.
inline constexpr int kMaxNesting = 256;

/// The longest element name the format holds, in UTF-16 code units.
inline constexpr int kMaxElementName = 31;
/// Whether a name may be given to an element: 1 to 31 code units, none of / \ : !
bool isValidElementName(const QString& name);

/// Parses a whole file; raises ide::Error stg::InvalidHeader when the bytes are not a compound file and
/// stg::DocFileCorrupt, with what is wrong, when it is damaged or truncated: a broken chain or size, a
/// directory link out of range or in a circle, an element in use that no link reaches, storages nested
/// deeper than kMaxNesting.
std::shared_ptr<Element> readCompoundFile(const QByteArray& bytes);

/// Lays out `root` and everything under it as the bytes of a compound file. Raises stg::WriteFault for a
/// tree nested deeper than kMaxNesting or too large for the format.
QByteArray writeCompoundFile(const Element& root);

}  // namespace projinfo
