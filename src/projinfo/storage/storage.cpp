// SPDX-License-Identifier: MIT
#include "projinfo/storage/storage.h"

#include "common/errors.h"
#include "ide/error.h"
#include "projinfo/storage/mdlstorage.h"

#include <QHash>
#include <QObject>
#include <QtEndian>

#include <cmath>
#include <cstring>
#include <limits>
#include <vector>

namespace projinfo {
namespace {

constexpr long kClassNotRegistered = static_cast<qint32>(0x80040154u);
constexpr char kNoPersistence[] = "The object must implement IPersistStream or IPersistStreamInit";

[[noreturn]] void fail(long number, const QString& detail = {}) {
  const QString text = GetSystemErrorText(number);
  throw ide::Error(number, detail.isEmpty() ? text : QStringLiteral("%1 (%2)").arg(text, detail));
}

QHash<QUuid, std::function<PersistStreamRef()>>& persistentClasses() {
  static QHash<QUuid, std::function<PersistStreamRef()>> classes;
  return classes;
}

const QDate kAutomationEpoch(1899, 12, 30);
// 1 January 100 and 31 December 9999, the first and last days an automation date can name.
constexpr double kFirstAutomationDate = -657434;
constexpr double kLastAutomationDate = 2958465;
constexpr long kOverflow = 6;

/// A deep copy, level by level without recursion.
std::shared_ptr<Element> copyOf(const Element& element) {
  auto copy = std::make_shared<Element>(element);
  std::vector<Element*> pending{copy.get()};
  while (!pending.empty()) {
    Element* next = pending.back();
    pending.pop_back();
    next->gone = false;
    for (auto& [key, child] : next->children) {
      child = std::make_shared<Element>(*child);
      pending.push_back(child.get());
    }
  }
  return copy;
}

bool contains(const Element& outer, const Element& inner) {
  std::vector<const Element*> pending{&outer};
  while (!pending.empty()) {
    const Element* next = pending.back();
    pending.pop_back();
    if (next == &inner) return true;
    for (const auto& [key, child] : next->children)
      if (child->isStorage()) pending.push_back(child.get());
  }
  return false;
}

template <class T>
QByteArray bytesOf(T value) {
  QByteArray bytes(sizeof(T), '\0');
  qToLittleEndian<T>(value, bytes.data());
  return bytes;
}

}  // namespace

void registerPersistentClass(const QUuid& classId, std::function<PersistStreamRef()> create) {
  persistentClasses().insert(classId, std::move(create));
}

QDateTime dateFromAutomation(double days) {
  if (!(days > kFirstAutomationDate - 1 && days < kLastAutomationDate + 1)) return {};
  // The whole part counts days (negative before the epoch); the fraction is always the time after
  // midnight, also for negative values.
  const double whole = std::trunc(days);
  const qint64 ms = std::llround(std::fabs(days - whole) * 86400000.0);
  return QDateTime(kAutomationEpoch.addDays(static_cast<qint64>(whole)), QTime(0, 0), Qt::UTC).addMSecs(ms);
}

double automationFromDate(const QDateTime& date) {
  const QDateTime utc(date.date(), date.time(), Qt::UTC);
  const qint64 day = kAutomationEpoch.daysTo(utc.date());
  const double fraction = utc.time().msecsSinceStartOfDay() / 86400000.0;
  return day >= 0 ? double(day) + fraction : double(day) - fraction;
}

// ---------------------------------------------------------------------------------------------------

QString VBSTATSTG::Clsid() const {
  return m_clsid.toString(QUuid::WithBraces).toUpper();
}

VBSTATSTG VBSTATSTG::of(const Element& element, qint32 mode) {
  VBSTATSTG stat;
  stat.m_name = element.name;
  stat.m_type = element.kind == ElementKind::Stream ? 2 : 1;
  stat.m_size = element.kind == ElementKind::Stream ? element.data.size() : 0;
  stat.m_modified = element.modified;
  stat.m_created = element.created;
  stat.m_mode = mode;
  stat.m_clsid = element.clsid;
  stat.m_stateBits = element.stateBits;
  return stat;
}

const VBSTATSTG& StorageElements::Item(qint32 index) const {
  if (index < 1 || index > Count()) ide::raise(ide::err::SubscriptOutOfRange);
  return m_items[static_cast<size_t>(index - 1)];
}

// ---------------------------------------------------------------------------------------------------
// Storage

std::shared_ptr<Storage> Storage::bind(ElementHandle handle, qint32 mode) {
  std::shared_ptr<Storage> storage(new Storage);
  storage->m_stat = VBSTATSTG::of(*handle.element, mode);
  storage->m_handle = std::move(handle);
  storage->m_mode = mode;
  return storage;
}

std::shared_ptr<Storage> Storage::unbound(const ide::Error& failure) {
  std::shared_ptr<Storage> storage(new Storage);
  storage->m_failure = failure;
  return storage;
}

Storage::~Storage() {
  try {
    if (m_handle.file && !m_handle.element->gone) m_handle.file->commit();
  } catch (const std::exception& failure) {
    // A destructor must not throw; the owner's explicit commits report the same failure.
    common::logFailure(failure, QStringLiteral("Storage"), QStringLiteral("~Storage"), __LINE__);
  }
}

const ElementHandle& Storage::handle() const {
  if (m_failure) throw *m_failure;
  if (!m_handle.element) fail(stg::InvalidHandle);
  if (m_handle.element->gone) fail(stg::Reverted);
  return m_handle;
}

Element& Storage::element() const {
  return *handle().element;
}

const ElementHandle& Storage::StorageInterface() const {
  return handle();
}

void Storage::checkWritable() const {
  if (!handle().file->writable() || (m_mode & 3) == STGM_READ) fail(stg::AccessDenied);
}

ElementMap::iterator Storage::find(const QString& name) const {
  return element().children.find(ElementKey(name));
}

std::shared_ptr<Element> Storage::child(const QString& name, ElementKind kind) const {
  const auto it = find(name);
  if (it == element().children.end()) fail(stg::FileNotFound, name);
  const bool storage = kind != ElementKind::Stream;
  if (it->second->isStorage() != storage)
    fail(stg::FileAlreadyExists,
         QStringLiteral("\"%1\" is a %2")
             .arg(name, storage ? QStringLiteral("stream") : QStringLiteral("storage")));
  return it->second;
}

void Storage::Commit(qint32 /*flags*/) {
  // Every commit writes the whole file through a temporary file, which is what overwriting in place
  // (flag 1) and the default both come to here.
  handle().file->commit();
}

namespace {
/// Runs a platform call whose failure is recorded (its number) before it reaches the caller.
template <class Call>
auto recorded(Call call) -> decltype(call()) {
  try {
    return call();
  } catch (const std::exception& failure) {
    common::recordErrorNumber(failure);
    throw;
  }
}
}  // namespace

std::shared_ptr<Element> Storage::createOrOpen(const QString& name, ElementKind kind) {
  if (find(name) == element().children.end()) {
    checkWritable();
    if (!isValidElementName(name)) fail(stg::InvalidName, name);
    auto created = std::make_shared<Element>();
    created->name = name;
    created->kind = kind;
    element().children.emplace(ElementKey(name), created);
    handle().file->touch();
  }
  // There already (or just made): opened with the same mode.
  return child(name, kind);
}

std::shared_ptr<Storage> Storage::CreateStorage(const QString& name, qint32 mode) {
  return recorded([&] {
    auto storage = bind({handle().file, createOrOpen(name, ElementKind::Storage)}, mode);
    storage->Parent = shared_from_this();
    return storage;
  });
}

std::shared_ptr<Stream> Storage::CreateStream(const QString& name, qint32 mode) {
  return recorded([&] {
    auto stream = Stream::bind({handle().file, createOrOpen(name, ElementKind::Stream)}, mode);
    stream->Parent = shared_from_this();
    return stream;
  });
}

std::shared_ptr<Storage> Storage::OpenStorage(const QString& name, qint32 mode) {
  return bind({handle().file, child(name, ElementKind::Storage)}, mode);
}

std::shared_ptr<Stream> Storage::OpenStream(const QString& name, qint32 mode) {
  return Stream::bind({handle().file, child(name, ElementKind::Stream)}, mode);
}

void Storage::DestroyElement(const QString& name) {
  checkWritable();
  const auto it = find(name);
  if (it == element().children.end()) fail(stg::FileNotFound, name);
  it->second->gone = true;
  markGone(*it->second);
  element().children.erase(it);
  handle().file->touch();
}

StorageElements Storage::Elements() {
  StorageElements elements;
  elements.m_items.reserve(element().children.size());
  for (const auto& [key, child] : element().children)
    elements.add(VBSTATSTG::of(*child, 0));
  return elements;
}

void Storage::MoveElementTo(const QString& name, const std::shared_ptr<Storage>& destination,
                            const QString& newName, qint32 flags) {
  if (!destination) fail(stg::InvalidParameter);
  checkWritable();
  destination->checkWritable();
  const auto it = find(name);
  if (it == element().children.end()) fail(stg::FileNotFound, name);
  if (!isValidElementName(newName)) fail(stg::InvalidName, newName);
  Element& target = destination->element();
  if (target.children.count(ElementKey(newName))) fail(stg::FileAlreadyExists, newName);
  if (contains(*it->second, target))
    fail(stg::InvalidParameter, QStringLiteral("%1 would go inside itself").arg(name));
  auto moved = copyOf(*it->second);
  moved->name = newName;
  target.children.emplace(ElementKey(newName), moved);
  destination->handle().file->touch();
  if (flags == STGMOVE_MOVE) DestroyElement(name);
}

void Storage::RenameElement(const QString& oldName, const QString& newName) {
  checkWritable();
  const auto it = find(oldName);
  if (it == element().children.end()) fail(stg::FileNotFound, oldName);
  if (!isValidElementName(newName)) fail(stg::InvalidName, newName);
  const auto existing = find(newName);
  if (existing != element().children.end() && existing != it) fail(stg::FileAlreadyExists, newName);
  auto renamed = it->second;
  element().children.erase(it);
  renamed->name = newName;
  element().children.emplace(ElementKey(newName), renamed);
  handle().file->touch();
}

void Storage::Revert() {
  handle().file->revert();
}

VBSTATSTG Storage::Stat() const {
  return VBSTATSTG::of(element(), m_mode);
}

// ---------------------------------------------------------------------------------------------------
// Stream

std::shared_ptr<Stream> Stream::bind(ElementHandle handle, qint32 mode) {
  std::shared_ptr<Stream> stream(new Stream);
  stream->m_handle = std::move(handle);
  stream->m_mode = mode;
  return stream;
}

Element& Stream::element() const {
  if (!m_handle.element) fail(stg::InvalidHandle);
  if (m_handle.element->gone) fail(stg::Reverted);
  return *m_handle.element;
}

std::shared_ptr<Stream> Stream::Clone() const {
  element();
  auto clone = bind(m_handle, m_mode);
  clone->m_position = m_position;
  clone->Parent = Parent;
  return clone;
}

void Stream::Commit(qint32 /*flags*/) {
  element();
  m_handle.file->commit();
}

VBSTATSTG Stream::Stat() const {
  return VBSTATSTG::of(element(), m_mode);
}

qint64 Stream::SSeek(qint64 position) {
  element();
  if (position < 0) fail(stg::InvalidFunction);
  m_position = position;
  return m_position;
}

void Stream::SetSize(qint64 size) {
  if (size < 0 || size > std::numeric_limits<qint32>::max()) fail(stg::InvalidParameter);
  Element& data = element();
  if (!m_handle.file->writable() || (m_mode & 3) == STGM_READ) fail(stg::AccessDenied);
  if (data.data.size() == size) return;
  data.data.resize(static_cast<qsizetype>(size), '\0');
  m_handle.file->touch();
}

QByteArray Stream::take(qint64 length) {
  const QByteArray& data = element().data;
  const qint64 available = std::max<qint64>(0, data.size() - m_position);
  const qint64 count = std::min(length, available);
  QByteArray bytes =
      count > 0 ? data.mid(static_cast<qsizetype>(m_position), static_cast<qsizetype>(count)) : QByteArray();
  m_position += count;
  return bytes;
}

qint32 Stream::put(const QByteArray& bytes) {
  Element& data = element();
  if (!m_handle.file->writable() || (m_mode & 3) == STGM_READ) fail(stg::AccessDenied);
  if (m_position + bytes.size() > std::numeric_limits<qint32>::max()) fail(stg::WriteFault);
  const qsizetype end = static_cast<qsizetype>(m_position) + bytes.size();
  // Writing past the end leaves zeros in the gap, as the platform does.
  if (data.data.size() < end) data.data.resize(end, '\0');
  std::memcpy(data.data.data() + m_position, bytes.constData(), static_cast<size_t>(bytes.size()));
  m_position = end;
  m_handle.file->touch();
  return static_cast<qint32>(bytes.size());
}

qint32 Stream::ReadBuf(QByteArray& buffer, qint32 length) {
  if (length < 0) fail(stg::InvalidParameter);
  const QByteArray bytes = take(length);
  buffer = bytes;
  buffer.resize(length, '\0');
  return static_cast<qint32>(bytes.size());
}

qint32 Stream::WriteBuf(const QByteArray& buffer) {
  return buffer.isEmpty() ? 0 : put(buffer);
}

qint64 Stream::CopyTo(const std::shared_ptr<Stream>& destination, qint64 count) {
  if (!destination) fail(stg::InvalidParameter);
  const QByteArray bytes = take(std::max<qint64>(0, count));
  const qint32 written = destination->WriteBuf(bytes);
  if (written != bytes.size()) throw ide::Error(static_cast<qint32>(0x80040000u), QString());
  return written;
}

QVariant Stream::ReadData(qint32 typeCode) {
  // Values cut short by the end of the stream read as far as the bytes go (the rest as zeros).
  auto fixed = [&](int size) {
    QByteArray bytes = take(size);
    bytes.resize(size, '\0');
    return bytes;
  };
  switch (typeCode) {
    case vbInteger:
      return QVariant::fromValue(qFromLittleEndian<qint16>(fixed(2).constData()));
    case vbLong:
      return QVariant::fromValue(qFromLittleEndian<qint32>(fixed(4).constData()));
    case vbSingle:
      return QVariant::fromValue(qFromLittleEndian<float>(fixed(4).constData()));
    case vbDouble:
      return QVariant::fromValue(qFromLittleEndian<double>(fixed(8).constData()));
    case vbCurrency:
      return QVariant::fromValue(Currency{qFromLittleEndian<qint64>(fixed(8).constData())});
    case vbDate: {
      const double days = qFromLittleEndian<double>(fixed(8).constData());
      const QDateTime date = dateFromAutomation(days);
      // Not a date at all (damage, or bytes of another type): refused as a conversion would refuse it.
      if (!date.isValid())
        throw ide::Error(kOverflow, QStringLiteral("Overflow (the date value %1 in the stream \"%2\")")
                                        .arg(days)
                                        .arg(element().name));
      return QVariant::fromValue(date);
    }
    case vbBoolean:
      return QVariant::fromValue(qFromLittleEndian<qint16>(fixed(2).constData()) != 0);
    case vbString: {
      const qint64 start = m_position;
      const qint32 count = qFromLittleEndian<qint32>(fixed(4).constData());
      // A count that the stream cannot hold is damage, not a string to make up.
      if (count < 0 || qint64(count) * 2 > element().data.size() - m_position) {
        m_position = start;
        fail(stg::ReadFault, QStringLiteral("the string's count %1 does not fit the stream \"%2\"")
                                 .arg(count)
                                 .arg(element().name));
      }
      const QByteArray units = take(qint64(count) * 2);
      return QString::fromUtf16(reinterpret_cast<const char16_t*>(units.constData()), count);
    }
    default:
      return {};
  }
}

qint32 Stream::WriteData(const QVariant& value) {
  try {
    switch (value.typeId()) {
      case QMetaType::Short:
        return put(bytesOf<qint16>(value.value<qint16>()));
      case QMetaType::Int:
        return put(bytesOf<qint32>(value.toInt()));
      case QMetaType::Float:
        return put(bytesOf<float>(value.toFloat()));
      case QMetaType::Double:
        return put(bytesOf<double>(value.toDouble()));
      case QMetaType::Bool:
        return put(bytesOf<qint16>(value.toBool() ? -1 : 0));
      case QMetaType::UChar:
        return put(QByteArray(1, static_cast<char>(value.value<uchar>())));
      case QMetaType::QDateTime:
        return put(bytesOf<double>(automationFromDate(value.toDateTime())));
      case QMetaType::QString: {
        const QString text = value.toString();
        const qint32 written = put(bytesOf<qint32>(static_cast<qint32>(text.size())));
        if (text.isEmpty()) return written;
        return put(QByteArray(reinterpret_cast<const char*>(text.utf16()), text.size() * 2));
      }
      default:
        break;
    }
    if (value.typeId() == qMetaTypeId<Currency>())
      return put(bytesOf<qint64>(value.value<Currency>().scaled));
    if (value.typeId() == qMetaTypeId<PersistStreamRef>()) {
      const qint64 start = m_position;
      WriteObject(value.value<PersistStreamRef>());
      return static_cast<qint32>(m_position - start);
    }
    if (value.typeId() == QMetaType::QObjectStar) {
      auto* object = dynamic_cast<PersistStream*>(value.value<QObject*>());
      if (!object && value.value<QObject*>())
        throw ide::Error(stg::NoInterface, QString::fromLatin1(kNoPersistence));
      if (!object) return put(QByteArray(16, '\0'));
    }
  } catch (const std::exception& failure) {
    common::recordError(failure, QStringLiteral("Stream"), QStringLiteral("WriteData"), __LINE__);
  }
  return 0;
}

void Stream::WriteObject(const PersistStreamRef& object) {
  if (!object) {
    put(QByteArray(16, '\0'));
    return;
  }
  QByteArray id(16, '\0');
  const QUuid classId = object->ClassId();
  qToLittleEndian<quint32>(classId.data1, id.data());
  qToLittleEndian<quint16>(classId.data2, id.data() + 4);
  qToLittleEndian<quint16>(classId.data3, id.data() + 6);
  std::memcpy(id.data() + 8, classId.data4, 8);
  put(id);
  put(bytesOf<qint16>(object->persistsAsStream() ? -1 : 0));
  object->Save(*this);
}

PersistStreamRef Stream::ReadObject() {
  QByteArray id = take(16);
  if (id.size() < 16 || id == QByteArray(16, '\0')) return nullptr;
  const bool asStream = ReadData(vbInteger).value<qint16>() != 0;
  const char* p = id.constData();
  const QUuid classId(qFromLittleEndian<quint32>(p), qFromLittleEndian<quint16>(p + 4),
                      qFromLittleEndian<quint16>(p + 6), uchar(p[8]), uchar(p[9]), uchar(p[10]), uchar(p[11]),
                      uchar(p[12]), uchar(p[13]), uchar(p[14]), uchar(p[15]));
  const auto factory = persistentClasses().value(classId);
  if (!factory) fail(kClassNotRegistered, classId.toString(QUuid::WithBraces).toUpper());
  PersistStreamRef object = factory();
  if (!object || object->persistsAsStream() != asStream) fail(stg::NoInterface);
  object->Load(*this);
  return object;
}

}  // namespace projinfo
