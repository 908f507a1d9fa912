// SPDX-License-Identifier: MIT
#include "projinfo/storage/compoundfile.h"

#include "ide/error.h"

#include <QtEndian>

#include <algorithm>
#include <cstring>
#include <vector>

namespace projinfo {
namespace {

constexpr quint32 kFreeSect = 0xFFFFFFFFu;
constexpr quint32 kEndOfChain = 0xFFFFFFFEu;
constexpr quint32 kFatSect = 0xFFFFFFFDu;
constexpr quint32 kDifSect = 0xFFFFFFFCu;
constexpr quint32 kNoStream = 0xFFFFFFFFu;
constexpr quint32 kMaxRegularSector = 0xFFFFFFFAu;

constexpr char kSignature[] = "\xD0\xCF\x11\xE0\xA1\xB1\x1A\xE1";
constexpr int kHeaderSize = 512;
constexpr int kDirEntrySize = 128;
constexpr int kHeaderDifat = 109;
constexpr quint32 kMiniCutoff = 4096;
constexpr int kWriteSector = 512;
constexpr int kWriteMiniSector = 64;

[[noreturn]] void corrupt(const QString& what) {
  throw ide::Error(stg::DocFileCorrupt, what);
}

quint16 u16(const char* p) {
  return qFromLittleEndian<quint16>(p);
}
quint32 u32(const char* p) {
  return qFromLittleEndian<quint32>(p);
}
quint64 u64(const char* p) {
  return qFromLittleEndian<quint64>(p);
}

QUuid uuidAt(const char* p) {
  return QUuid(u32(p), u16(p + 4), u16(p + 6), static_cast<uchar>(p[8]), static_cast<uchar>(p[9]),
               static_cast<uchar>(p[10]), static_cast<uchar>(p[11]), static_cast<uchar>(p[12]),
               static_cast<uchar>(p[13]), static_cast<uchar>(p[14]), static_cast<uchar>(p[15]));
}

void putUuid(char* p, const QUuid& id) {
  qToLittleEndian<quint32>(id.data1, p);
  qToLittleEndian<quint16>(id.data2, p + 4);
  qToLittleEndian<quint16>(id.data3, p + 6);
  std::memcpy(p + 8, id.data4, 8);
}

struct DirEntry {
  QString name;
  quint8 type = 0;
  quint32 left = kNoStream, right = kNoStream, child = kNoStream;
  QUuid clsid;
  quint32 stateBits = 0;
  quint64 created = 0, modified = 0;
  quint32 start = kEndOfChain;
  quint64 size = 0;
};

class Reader {
 public:
  explicit Reader(const QByteArray& bytes) : m_bytes(bytes) {}

  std::shared_ptr<Element> read() {
    readHeader();
    readFat();
    readDirectory();
    const DirEntry& root = m_entries[0];
    if (root.type != static_cast<quint8>(ElementKind::Root))
      corrupt(QStringLiteral("the first entry is not the root"));
    if (m_miniFatSectors > 0) {
      const QByteArray miniFat =
          chainBytes(m_firstMiniFat, m_fat, m_sectorSize, quint64(m_miniFatSectors) * m_sectorSize,
                     QStringLiteral("the mini allocation table"));
      m_miniFat.resize(static_cast<size_t>(miniFat.size() / 4));
      for (size_t i = 0; i < m_miniFat.size(); ++i)
        m_miniFat[i] = u32(miniFat.constData() + 4 * i);
    }
    if (root.size > 0) {
      if (root.size > quint64(m_bytes.size()))
        corrupt(QStringLiteral("the mini stream is larger than the file"));
      m_miniStream =
          chainBytes(root.start, m_fat, m_sectorSize, root.size, QStringLiteral("the mini stream"));
    }
    m_seen.assign(m_entries.size(), false);
    m_seen[0] = true;
    auto element = std::make_shared<Element>();
    element->kind = ElementKind::Root;
    element->name = root.name;
    element->clsid = root.clsid;
    element->stateBits = root.stateBits;
    element->modified = root.modified;
    readTree(*element);
    return element;
  }

 private:
  void readHeader() {
    if (m_bytes.size() < 8 || std::memcmp(m_bytes.constData(), kSignature, 8) != 0)
      throw ide::Error(stg::InvalidHeader,
                       QStringLiteral("not a compound file (no compound-file signature)"));
    if (m_bytes.size() < kHeaderSize) corrupt(QStringLiteral("truncated: the file ends inside its header"));
    const char* h = m_bytes.constData();
    const quint16 major = u16(h + 0x1A);
    const quint16 shift = u16(h + 0x1E);
    if (u16(h + 0x1C) != 0xFFFE || !((major == 3 && shift == 9) || (major == 4 && shift == 12)) ||
        u16(h + 0x20) != 6)
      corrupt(QStringLiteral("the header has an unknown version, byte order or sector size"));
    m_sectorSize = 1u << shift;
    m_sectorCount = (quint64(m_bytes.size()) > m_sectorSize)
                        ? (quint64(m_bytes.size()) - m_sectorSize + m_sectorSize - 1) / m_sectorSize
                        : 0;
    m_fatSectors = u32(h + 0x2C);
    m_firstDir = u32(h + 0x30);
    if (u32(h + 0x38) != kMiniCutoff) corrupt(QStringLiteral("the header's mini-stream cutoff is not 4096"));
    m_firstMiniFat = u32(h + 0x3C);
    m_miniFatSectors = u32(h + 0x40);
    m_firstDifat = u32(h + 0x44);
    m_difatSectors = u32(h + 0x48);
    if (m_fatSectors > m_sectorCount || m_miniFatSectors > m_sectorCount || m_difatSectors > m_sectorCount)
      corrupt(QStringLiteral("truncated: the header counts more sectors than the file holds"));
  }

  /// The bytes of sector `index` that the caller needs (`length`, at most a sector); refuses sectors past
  /// the end of the file.
  const char* sector(quint32 index, quint32 length, const QString& what) const {
    const quint64 offset = (quint64(index) + 1) * m_sectorSize;
    if (index > kMaxRegularSector || offset + length > quint64(m_bytes.size()))
      corrupt(QStringLiteral("truncated: %1 lies past the end of the file").arg(what));
    return m_bytes.constData() + offset;
  }

  void readFat() {
    std::vector<quint32> fatSectors;
    fatSectors.reserve(m_fatSectors);
    const char* h = m_bytes.constData();
    for (int i = 0; i < kHeaderDifat && fatSectors.size() < m_fatSectors; ++i)
      fatSectors.push_back(u32(h + 0x4C + 4 * i));
    quint32 next = m_firstDifat;
    const quint32 perDifat = m_sectorSize / 4 - 1;
    for (quint32 d = 0; d < m_difatSectors && fatSectors.size() < m_fatSectors; ++d) {
      const char* s = sector(next, m_sectorSize, QStringLiteral("a sector of the allocation table's index"));
      for (quint32 i = 0; i < perDifat && fatSectors.size() < m_fatSectors; ++i)
        fatSectors.push_back(u32(s + 4 * i));
      next = u32(s + 4 * perDifat);
    }
    if (fatSectors.size() < m_fatSectors)
      corrupt(QStringLiteral("the allocation table's index is incomplete"));
    m_fat.resize(size_t(m_fatSectors) * (m_sectorSize / 4));
    for (size_t k = 0; k < fatSectors.size(); ++k) {
      const char* s = sector(fatSectors[k], m_sectorSize, QStringLiteral("a sector of the allocation table"));
      for (quint32 i = 0; i < m_sectorSize / 4; ++i)
        m_fat[k * (m_sectorSize / 4) + i] = u32(s + 4 * i);
    }
  }

  /// Follows a chain from `start` in `table` and returns its first `size` bytes, read from `unit`-sized
  /// pieces (regular sectors, or mini sectors of the mini stream).
  QByteArray chainBytes(quint32 start, const std::vector<quint32>& table, quint32 unit, quint64 size,
                        const QString& what) const {
    const bool mini = &table == &m_miniFat;
    QByteArray out;
    out.resize(static_cast<qsizetype>(size));
    quint64 done = 0;
    quint32 current = start;
    size_t steps = 0;
    while (done < size) {
      if (current == kEndOfChain || current >= table.size())
        corrupt(QStringLiteral("%1 is shorter than its size says").arg(what));
      if (++steps > table.size()) corrupt(QStringLiteral("%1 runs in a circle").arg(what));
      const quint32 length = static_cast<quint32>(std::min<quint64>(unit, size - done));
      const char* piece = nullptr;
      if (mini) {
        const quint64 offset = quint64(current) * unit;
        if (offset + length > quint64(m_miniStream.size()))
          corrupt(QStringLiteral("%1 lies past the end of the mini stream").arg(what));
        piece = m_miniStream.constData() + offset;
      } else {
        piece = sector(current, length, what);
      }
      std::memcpy(out.data() + done, piece, length);
      done += length;
      current = table[current];
    }
    return out;
  }

  void readDirectory() {
    // The directory has no size of its own: its chain is followed to the end.
    QByteArray dir;
    quint32 current = m_firstDir;
    size_t steps = 0;
    while (current != kEndOfChain) {
      if (current >= m_fat.size() || ++steps > m_fat.size())
        corrupt(QStringLiteral("the directory's sector chain is broken"));
      dir.append(sector(current, m_sectorSize, QStringLiteral("a directory sector")), m_sectorSize);
      current = m_fat[current];
    }
    const qsizetype count = dir.size() / kDirEntrySize;
    if (count == 0) corrupt(QStringLiteral("the directory is empty"));
    m_entries.resize(static_cast<size_t>(count));
    for (qsizetype i = 0; i < count; ++i) {
      const char* e = dir.constData() + i * kDirEntrySize;
      DirEntry& entry = m_entries[static_cast<size_t>(i)];
      entry.type = static_cast<quint8>(e[0x42]);
      if (entry.type == 0) continue;
      const quint16 nameBytes = u16(e + 0x40);
      if (nameBytes < 2 || nameBytes > 64 || nameBytes % 2 != 0)
        corrupt(QStringLiteral("directory entry %1 has an invalid name length").arg(i));
      entry.name = QString::fromUtf16(reinterpret_cast<const char16_t*>(e), nameBytes / 2 - 1);
      entry.left = u32(e + 0x44);
      entry.right = u32(e + 0x48);
      entry.child = u32(e + 0x4C);
      entry.clsid = uuidAt(e + 0x50);
      entry.stateBits = u32(e + 0x60);
      entry.created = u64(e + 0x64);
      entry.modified = u64(e + 0x6C);
      entry.start = u32(e + 0x74);
      // Version 3 files keep only 32 bits of size; the upper half may hold anything.
      entry.size = m_sectorSize == 512 ? u32(e + 0x78) : u64(e + 0x78);
    }
  }

  /// Builds the tree below the root. Siblings form a binary tree through their left and right links, and
  /// storages nest through their child link; both are walked with a list of pending links rather than by
  /// recursion, since a damaged file may make either as deep as the file is long.
  void readTree(Element& rootElement) {
    struct Pending {
      quint32 id;
      Element* parent;
      int depth;
    };
    std::vector<Pending> pending;
    if (m_entries[0].child != kNoStream) pending.push_back({m_entries[0].child, &rootElement, 1});
    while (!pending.empty()) {
      const Pending link = pending.back();
      pending.pop_back();
      const quint32 id = link.id;
      if (id >= m_entries.size()) corrupt(QStringLiteral("a directory link points past the directory"));
      if (m_seen[id]) corrupt(QStringLiteral("directory entry %1 is linked twice").arg(id));
      m_seen[id] = true;
      const DirEntry& entry = m_entries[id];
      if (entry.left != kNoStream) pending.push_back({entry.left, link.parent, link.depth});
      if (entry.right != kNoStream) pending.push_back({entry.right, link.parent, link.depth});
      if (entry.type != 1 && entry.type != 2)
        corrupt(QStringLiteral("directory entry %1 has an invalid type").arg(id));
      auto element = std::make_shared<Element>();
      element->name = entry.name;
      element->kind = static_cast<ElementKind>(entry.type);
      element->clsid = entry.clsid;
      element->stateBits = entry.stateBits;
      element->created = entry.created;
      element->modified = entry.modified;
      if (element->kind == ElementKind::Stream) {
        const QString what = QStringLiteral("the stream \"%1\"").arg(entry.name);
        if (entry.size < kMiniCutoff) {
          if (entry.size > quint64(m_miniStream.size()))
            corrupt(what + QStringLiteral(" is larger than the mini stream"));
          element->data = chainBytes(entry.start, m_miniFat, 64, entry.size, what);
        } else {
          if (entry.size > quint64(m_bytes.size()))
            corrupt(what + QStringLiteral(" is larger than the file"));
          element->data = chainBytes(entry.start, m_fat, m_sectorSize, entry.size, what);
        }
      } else if (entry.child != kNoStream) {
        if (link.depth >= kMaxNesting)
          corrupt(QStringLiteral("its storages are nested more than %1 deep").arg(kMaxNesting));
        pending.push_back({entry.child, element.get(), link.depth + 1});
      }
      if (!link.parent->children.emplace(ElementKey(element->name), element).second)
        corrupt(QStringLiteral("two elements are named \"%1\"").arg(entry.name));
    }
    // An element in use that no link reaches would be lost without a word by the next write.
    for (size_t id = 1; id < m_entries.size(); ++id)
      if (m_entries[id].type != 0 && !m_seen[id])
        corrupt(QStringLiteral("directory entry %1 (\"%2\") is not reached from the root")
                    .arg(id)
                    .arg(m_entries[id].name));
  }

  const QByteArray& m_bytes;
  quint32 m_sectorSize = 512;
  quint64 m_sectorCount = 0;
  quint32 m_fatSectors = 0, m_firstDir = 0, m_firstMiniFat = 0, m_miniFatSectors = 0;
  quint32 m_firstDifat = 0, m_difatSectors = 0;
  std::vector<quint32> m_fat, m_miniFat;
  QByteArray m_miniStream;
  std::vector<DirEntry> m_entries;
  std::vector<bool> m_seen;
};

// ---------------------------------------------------------------------------------------------------
// Writing

struct OutEntry {
  const Element* element;
  quint32 left = kNoStream, right = kNoStream, child = kNoStream;
  bool red = false;
  quint32 start = kEndOfChain;
  quint64 size = 0;
};

class Writer {
 public:
  explicit Writer(const Element& root) {
    m_entries.push_back({&root});
    addChildren(0);
  }

  QByteArray write() {
    // Streams under the cutoff share the mini stream; the rest get sectors of their own.
    quint32 miniSectors = 0;
    quint64 regularSectors = 0;
    for (OutEntry& entry : m_entries) {
      if (entry.element->kind != ElementKind::Stream) continue;
      entry.size = quint64(entry.element->data.size());
      if (entry.size == 0) continue;
      if (entry.size < kMiniCutoff)
        miniSectors += static_cast<quint32>((entry.size + kWriteMiniSector - 1) / kWriteMiniSector);
      else
        regularSectors += (entry.size + kWriteSector - 1) / kWriteSector;
    }
    const quint32 perSector = kWriteSector / 4;
    const quint32 dirSectors = static_cast<quint32>((m_entries.size() + 3) / 4);
    const quint32 miniFatSectors = (miniSectors + perSector - 1) / perSector;
    const quint32 miniStreamSectors = (miniSectors * kWriteMiniSector + kWriteSector - 1) / kWriteSector;
    const quint64 dataSectors = quint64(dirSectors) + miniFatSectors + miniStreamSectors + regularSectors;
    quint32 fatSectors = 0, difatSectors = 0;
    for (;;) {
      const quint64 total = dataSectors + fatSectors + difatSectors;
      const quint32 fat = static_cast<quint32>((total + perSector - 1) / perSector);
      const quint32 difat = fat > kHeaderDifat ? (fat - kHeaderDifat + perSector - 2) / (perSector - 1) : 0;
      if (fat == fatSectors && difat == difatSectors) break;
      fatSectors = fat;
      difatSectors = difat;
    }
    const quint64 totalSectors = dataSectors + fatSectors + difatSectors;
    if (totalSectors >= kMaxRegularSector)
      throw ide::Error(stg::WriteFault, QStringLiteral("the file would be too large"));

    std::vector<quint32> fat(size_t(fatSectors) * perSector, kFreeSect);
    quint32 next = 0;
    auto chain = [&](quint32 count) {
      const quint32 first = next;
      for (quint32 i = 0; i < count; ++i)
        fat[first + i] = i + 1 < count ? first + i + 1 : kEndOfChain;
      next += count;
      return count ? first : kEndOfChain;
    };
    for (quint32 i = 0; i < fatSectors; ++i)
      fat[next++] = kFatSect;
    const quint32 firstDifat = difatSectors ? next : kEndOfChain;
    for (quint32 i = 0; i < difatSectors; ++i)
      fat[next++] = kDifSect;
    const quint32 firstDir = chain(dirSectors);
    const quint32 firstMiniFat = chain(miniFatSectors);
    const quint32 firstMiniStream = chain(miniStreamSectors);

    // Mini sectors are handed out in entry order, as are the regular streams' sectors.
    std::vector<quint32> miniFat(size_t(miniFatSectors) * perSector, kFreeSect);
    quint32 nextMini = 0;
    for (OutEntry& entry : m_entries) {
      if (entry.element->kind != ElementKind::Stream || entry.size == 0) continue;
      if (entry.size < kMiniCutoff) {
        const quint32 count = static_cast<quint32>((entry.size + kWriteMiniSector - 1) / kWriteMiniSector);
        entry.start = nextMini;
        for (quint32 i = 0; i < count; ++i)
          miniFat[nextMini + i] = i + 1 < count ? nextMini + i + 1 : kEndOfChain;
        nextMini += count;
      } else {
        entry.start = chain(static_cast<quint32>((entry.size + kWriteSector - 1) / kWriteSector));
      }
    }
    m_entries[0].start = miniSectors ? firstMiniStream : kEndOfChain;
    m_entries[0].size = quint64(miniSectors) * kWriteMiniSector;

    QByteArray out(static_cast<qsizetype>((totalSectors + 1) * kWriteSector), '\0');
    char* base = out.data();
    auto at = [&](quint32 sectorIndex) { return base + (quint64(sectorIndex) + 1) * kWriteSector; };

    // Header.
    std::memcpy(base, kSignature, 8);
    qToLittleEndian<quint16>(0x003E, base + 0x18);
    qToLittleEndian<quint16>(3, base + 0x1A);
    qToLittleEndian<quint16>(0xFFFE, base + 0x1C);
    qToLittleEndian<quint16>(9, base + 0x1E);
    qToLittleEndian<quint16>(6, base + 0x20);
    qToLittleEndian<quint32>(fatSectors, base + 0x2C);
    qToLittleEndian<quint32>(firstDir, base + 0x30);
    qToLittleEndian<quint32>(kMiniCutoff, base + 0x38);
    qToLittleEndian<quint32>(miniFatSectors ? firstMiniFat : kEndOfChain, base + 0x3C);
    qToLittleEndian<quint32>(miniFatSectors, base + 0x40);
    qToLittleEndian<quint32>(firstDifat, base + 0x44);
    qToLittleEndian<quint32>(difatSectors, base + 0x48);
    for (int i = 0; i < kHeaderDifat; ++i)
      qToLittleEndian<quint32>(quint32(i) < fatSectors ? quint32(i) : kFreeSect, base + 0x4C + 4 * i);

    // The allocation table, its index beyond the header's 109 entries, the mini table.
    for (size_t i = 0; i < fat.size(); ++i)
      qToLittleEndian<quint32>(fat[i], at(static_cast<quint32>(i / perSector)) + 4 * (i % perSector));
    for (quint32 d = 0; d < difatSectors; ++d) {
      char* s = at(firstDifat + d);
      for (quint32 i = 0; i < perSector - 1; ++i) {
        const quint32 index = kHeaderDifat + d * (perSector - 1) + i;
        qToLittleEndian<quint32>(index < fatSectors ? index : kFreeSect, s + 4 * i);
      }
      qToLittleEndian<quint32>(d + 1 < difatSectors ? firstDifat + d + 1 : kEndOfChain,
                               s + 4 * (perSector - 1));
    }
    for (size_t i = 0; i < miniFat.size(); ++i)
      qToLittleEndian<quint32>(miniFat[i],
                               at(firstMiniFat + static_cast<quint32>(i / perSector)) + 4 * (i % perSector));

    // The directory.
    for (size_t i = 0; i < dirSectors * 4u; ++i) {
      char* e = at(firstDir + static_cast<quint32>(i / 4)) + (i % 4) * kDirEntrySize;
      if (i >= m_entries.size()) {
        qToLittleEndian<quint32>(kNoStream, e + 0x44);
        qToLittleEndian<quint32>(kNoStream, e + 0x48);
        qToLittleEndian<quint32>(kNoStream, e + 0x4C);
        continue;
      }
      const OutEntry& entry = m_entries[i];
      const Element& element = *entry.element;
      const QString name = element.kind == ElementKind::Root ? QStringLiteral("Root Entry") : element.name;
      std::memcpy(e, name.utf16(), size_t(name.size()) * 2);
      qToLittleEndian<quint16>(static_cast<quint16>((name.size() + 1) * 2), e + 0x40);
      e[0x42] = static_cast<char>(element.kind);
      e[0x43] = entry.red ? 0 : 1;
      qToLittleEndian<quint32>(entry.left, e + 0x44);
      qToLittleEndian<quint32>(entry.right, e + 0x48);
      qToLittleEndian<quint32>(entry.child, e + 0x4C);
      if (element.kind != ElementKind::Stream) putUuid(e + 0x50, element.clsid);
      qToLittleEndian<quint32>(element.stateBits, e + 0x60);
      if (element.kind == ElementKind::Storage) qToLittleEndian<quint64>(element.created, e + 0x64);
      if (element.kind != ElementKind::Stream) qToLittleEndian<quint64>(element.modified, e + 0x6C);
      qToLittleEndian<quint32>(element.kind == ElementKind::Storage ? 0 : entry.start, e + 0x74);
      qToLittleEndian<quint64>(entry.size, e + 0x78);
    }

    // The data.
    for (const OutEntry& entry : m_entries) {
      if (entry.element->kind != ElementKind::Stream || entry.size == 0) continue;
      const QByteArray& data = entry.element->data;
      if (entry.size < kMiniCutoff)
        std::memcpy(at(firstMiniStream) + quint64(entry.start) * kWriteMiniSector, data.constData(),
                    entry.size);
      else
        std::memcpy(at(entry.start), data.constData(), entry.size);
    }
    return out;
  }

 private:
  /// Gives the children of each storage consecutive ids and links them as a balanced tree, storage by
  /// storage in depth-first order (a storage's children, then everything below its first child storage,
  /// then below the next), with a list of pending storages instead of recursion.
  void addChildren(size_t rootEntry) {
    std::vector<std::pair<size_t, int>> pending{{rootEntry, 0}};
    while (!pending.empty()) {
      const auto [parent, depth] = pending.back();
      pending.pop_back();
      const Element& element = *m_entries[parent].element;
      if (element.children.empty()) continue;
      if (depth >= kMaxNesting)
        throw ide::Error(stg::WriteFault,
                         QStringLiteral("the storages would be nested more than %1 deep").arg(kMaxNesting));
      const size_t first = m_entries.size();
      for (const auto& [key, child] : element.children)
        m_entries.push_back({child.get()});
      const size_t count = element.children.size();
      int height = 0;
      while ((size_t(2) << height) - 1 < count)
        ++height;
      // A tree whose last level is incomplete keeps every path equally black by making that level red.
      const bool full = (size_t(2) << height) - 1 == count;
      m_entries[parent].child = link(first, 0, count, 0, height, full);
      for (size_t i = first + count; i-- > first;)
        if (m_entries[i].element->isStorage()) pending.emplace_back(i, depth + 1);
    }
  }

  quint32 link(size_t first, size_t lo, size_t hi, int depth, int height, bool full) {
    if (lo >= hi) return kNoStream;
    const size_t mid = lo + (hi - lo) / 2;
    OutEntry& entry = m_entries[first + mid];
    entry.red = !full && depth == height;
    entry.left = link(first, lo, mid, depth + 1, height, full);
    m_entries[first + mid].right = link(first, mid + 1, hi, depth + 1, height, full);
    return static_cast<quint32>(first + mid);
  }

  std::vector<OutEntry> m_entries;
};

}  // namespace

Element::~Element() {
  // Children that nobody else holds are emptied here before they go, so that no destructor runs inside
  // another one more than a level deep.
  std::vector<std::shared_ptr<Element>> pending;
  for (auto& [key, child] : children)
    pending.push_back(std::move(child));
  while (!pending.empty()) {
    std::shared_ptr<Element> element = std::move(pending.back());
    pending.pop_back();
    if (element.use_count() != 1) continue;
    for (auto& [key, child] : element->children)
      pending.push_back(std::move(child));
  }
}

bool isValidElementName(const QString& name) {
  if (name.isEmpty() || name.size() > kMaxElementName) return false;
  for (const QChar c : name)
    if (c == u'/' || c == u'\\' || c == u':' || c == u'!') return false;
  return true;
}

std::shared_ptr<Element> readCompoundFile(const QByteArray& bytes) {
  return Reader(bytes).read();
}

QByteArray writeCompoundFile(const Element& root) {
  return Writer(root).write();
}

}  // namespace projinfo
