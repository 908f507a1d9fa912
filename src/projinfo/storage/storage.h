// SPDX-License-Identifier: MIT
// The object layer over compound files through which the add-in reads and writes them: Storage (a
// storage: create, open, list, rename, move and destroy its elements), Stream (a stream with typed reads
// and writes), StorageElements and VBSTATSTG (the description of the elements of a storage).
//
// Typed values are laid out with no tags, headers or padding, little-endian, one after the other; the
// reader asks for the same types in the same order:
//   2 16-bit integer (2 bytes)  3 32-bit integer (4)  4 single (4)  5 double (8)  6 currency (8: the
//   value times 10000 as a 64-bit integer)  7 date (8: a double counting days from 30 December 1899, the
//   fraction being the time of day)  8 string (a 32-bit count n, then n UTF-16LE code units)  9 object
//   (its 16-byte class identifier, a 16-bit flag and what the object writes; 16 zero bytes for none)
//   11 Boolean (2 bytes: -1 or 0)  17 byte (1).
//
// Access modes are the platform's storage mode bits: read (0), write (1), read-write (2), share-exclusive
// (16), create (4096). Every failure raises ide::Error with the platform's code (projinfo::stg).
#pragma once

#include "ide/error.h"
#include "projinfo/storage/docfile.h"

#include <QDateTime>
#include <QMetaType>
#include <QString>
#include <QVariant>

#include <functional>
#include <memory>
#include <optional>
#include <vector>

namespace projinfo {

inline constexpr qint32 STGM_READ = 0;
inline constexpr qint32 STGM_WRITE = 1;
inline constexpr qint32 STGM_READWRITE = 2;
inline constexpr qint32 STGM_SHARE_EXCLUSIVE = 16;
inline constexpr qint32 STGM_CREATE = 4096;
inline constexpr qint32 STGM_FAILIFTHERE = 0;
/// The mode the add-in opens every element with: read-write, exclusive.
inline constexpr qint32 kElementMode = STGM_READWRITE | STGM_SHARE_EXCLUSIVE;
/// MoveElementTo: move, or copy and keep the original.
inline constexpr qint32 STGMOVE_MOVE = 0;
inline constexpr qint32 STGMOVE_COPY = 1;

/// Type codes of ReadData.
enum DataType : qint32 {
  vbInteger = 2,
  vbLong = 3,
  vbSingle = 4,
  vbDouble = 5,
  vbCurrency = 6,
  vbDate = 7,
  vbString = 8,
  vbObject = 9,
  vbBoolean = 11,
  vbByte = 17,
};

/// A currency value: the amount times 10000.
struct Currency {
  qint64 scaled = 0;
  friend bool operator==(Currency, Currency) = default;
};

class Stream;

/// An object that saves itself into a stream and loads itself from one.
class PersistStream {
 public:
  virtual ~PersistStream() = default;
  virtual QUuid ClassId() const = 0;
  /// Saved through the stream interface (true) or the stream-with-initialisation one (false).
  virtual bool persistsAsStream() const { return true; }
  virtual void Save(Stream& stream) = 0;
  virtual void Load(Stream& stream) = 0;
};
using PersistStreamRef = std::shared_ptr<PersistStream>;

/// Makes a class known to ReadObject by its class identifier.
void registerPersistentClass(const QUuid& classId, std::function<PersistStreamRef()> create);

/// An automation date as a date and time, and back. A value outside the years 100 to 9999 (or not a
/// number) gives an invalid date.
QDateTime dateFromAutomation(double days);
double automationFromDate(const QDateTime& date);

/// The description of one element.
class VBSTATSTG {
 public:
  QString Name() const { return m_name; }
  /// The class identifier in registry form, "{D5CDD502-2E9C-101B-9397-08002B2CF9AE}".
  QString Clsid() const;
  /// 1 storage, 2 stream.
  qint32 StorageType() const { return m_type; }
  qint64 size() const { return m_size; }
  quint64 modified() const { return m_modified; }
  quint64 created() const { return m_created; }
  qint32 mode() const { return m_mode; }
  quint32 stateBits() const { return m_stateBits; }

  static VBSTATSTG of(const Element& element, qint32 mode);

 private:
  QString m_name;
  qint32 m_type = 0;
  qint64 m_size = 0;
  quint64 m_modified = 0, m_created = 0;
  qint32 m_mode = 0;
  QUuid m_clsid;
  quint32 m_stateBits = 0;
};

/// The elements of a storage, in the order the storage lists them; Item is 1-based.
class StorageElements {
 public:
  qint32 Count() const { return static_cast<qint32>(m_items.size()); }
  /// Raises error 9 outside 1 to Count.
  const VBSTATSTG& Item(qint32 index) const;
  auto begin() const { return m_items.begin(); }
  auto end() const { return m_items.end(); }

 private:
  friend class Storage;
  void add(VBSTATSTG item) { m_items.push_back(std::move(item)); }
  std::vector<VBSTATSTG> m_items;
};

/// What a Storage or Stream wraps: an element of an open file.
struct ElementHandle {
  std::shared_ptr<DocFile> file;
  std::shared_ptr<Element> element;
};

class Storage : public std::enable_shared_from_this<Storage> {
 public:
  /// Destroying a storage commits the file once, ignoring failures.
  ~Storage();
  Storage(const Storage&) = delete;
  Storage& operator=(const Storage&) = delete;

  /// Set for storages made by CreateStorage and streams made by CreateStream.
  std::shared_ptr<Storage> Parent;

  /// Writes the file (every storage of a file commits the whole file).
  void Commit(qint32 flags);
  /// Creates the element, or opens it when it exists already (then positioned at its start).
  std::shared_ptr<Storage> CreateStorage(const QString& name, qint32 mode);
  std::shared_ptr<Stream> CreateStream(const QString& name, qint32 mode);
  void DestroyElement(const QString& name);
  StorageElements Elements();
  void MoveElementTo(const QString& name, const std::shared_ptr<Storage>& destination, const QString& newName,
                     qint32 flags);
  std::shared_ptr<Storage> OpenStorage(const QString& name, qint32 mode);
  std::shared_ptr<Stream> OpenStream(const QString& name, qint32 mode);
  void RenameElement(const QString& oldName, const QString& newName);
  /// Drops every change made to the file since its last commit.
  void Revert();
  /// The wrapped storage.
  const ElementHandle& StorageInterface() const;
  VBSTATSTG Stat() const;

  /// Binds a new Storage to an element.
  static std::shared_ptr<Storage> bind(ElementHandle handle, qint32 mode);
  /// A Storage bound to nothing: its first operation raises `failure`.
  static std::shared_ptr<Storage> unbound(const ide::Error& failure);
  bool isBound() const { return m_handle.element != nullptr; }

 private:
  Storage() = default;
  const ElementHandle& handle() const;
  Element& element() const;
  void checkWritable() const;
  ElementMap::iterator find(const QString& name) const;
  std::shared_ptr<Element> child(const QString& name, ElementKind kind) const;
  std::shared_ptr<Element> createOrOpen(const QString& name, ElementKind kind);

  ElementHandle m_handle;
  qint32 m_mode = 0;
  VBSTATSTG m_stat;
  std::optional<ide::Error> m_failure;
};

class Stream {
 public:
  Stream(const Stream&) = delete;
  Stream& operator=(const Stream&) = delete;

  std::shared_ptr<Storage> Parent;

  /// A second stream on the same data, with a seek position of its own (starting where this one is).
  std::shared_ptr<Stream> Clone() const;
  /// Writes the file.
  void Commit(qint32 flags);
  /// Copies `count` bytes from here to `destination`'s position; returns the bytes copied.
  qint64 CopyTo(const std::shared_ptr<Stream>& destination, qint64 count);
  /// Streams are written directly: nothing to undo.
  void Revert() {}
  void SetSize(qint64 size);
  /// Reads up to `length` bytes into `buffer` (resized to `length`); returns the bytes read.
  qint32 ReadBuf(QByteArray& buffer, qint32 length);
  /// Null for an object record of sixteen zero bytes.
  PersistStreamRef ReadObject();
  /// A value of type `typeCode`; an empty value for codes it does not read (objects, bytes and others). A
  /// string whose count is negative or runs past the end of the stream raises stg::ReadFault, a date
  /// outside the years 100 to 9999 error 6 (overflow).
  QVariant ReadData(qint32 typeCode);
  qint64 SSeek(qint64 position);
  VBSTATSTG Stat() const;
  const ElementHandle& StreamInterface() const { return m_handle; }
  /// Writes the whole buffer; returns the bytes written.
  qint32 WriteBuf(const QByteArray& buffer);
  /// Writes `value` by its type (see above); other types write nothing. Never raises: a failure is recorded
  /// in the last-error record and gives 0. Returns the byte count of the last write it made.
  qint32 WriteData(const QVariant& value);
  void WriteObject(const PersistStreamRef& object);

  static std::shared_ptr<Stream> bind(ElementHandle handle, qint32 mode);
  qint64 position() const { return m_position; }

 private:
  Stream() = default;
  Element& element() const;
  /// Reads up to `length` bytes at the position, moving it.
  QByteArray take(qint64 length);
  qint32 put(const QByteArray& bytes);

  ElementHandle m_handle;
  qint32 m_mode = 0;
  qint64 m_position = 0;
};

}  // namespace projinfo

Q_DECLARE_METATYPE(projinfo::Currency)
Q_DECLARE_METATYPE(projinfo::PersistStreamRef)
