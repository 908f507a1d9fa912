// SPDX-License-Identifier: MIT
// Reading the records of a binary file by the layout of the property that refers to them, and rebuilding the
// file in the description's order when one of them changes.
#include "host/files/frxfile.h"

#include "host/files/ansi.h"
#include "host/files/controlclasses.h"

#include "ide/error.h"

#include <algorithm>
#include <cstring>
#include <limits>
#include <set>

namespace host {
namespace {

constexpr char kPictureSignature[] = {'l', 't', '\0', '\0'};
constexpr qsizetype kPictureHeader = 12;
constexpr qsizetype kListHeader = 4;

bool isPictureProperty(QStringView name) {
  for (const char* picture :
       {"Picture", "Icon", "MouseIcon", "DragIcon", "DownPicture", "DisabledPicture", "Palette"}) {
    if (name.compare(QLatin1StringView(picture), Qt::CaseInsensitive) == 0) return true;
  }
  return false;
}

void appendNumber(QByteArray& out, quint32 value, int size) {
  for (int i = 0; i < size; ++i)
    out.append(static_cast<char>((value >> (8 * i)) & 0xFF));
}

}  // namespace

std::optional<FrxReference> parseFrxReference(QStringView valueText) {
  QStringView text = valueText.trimmed();
  FrxReference reference;
  if (text.startsWith(u'$')) {
    reference.longText = true;
    text = text.mid(1);
  }
  // "<file>":<hex digits>; the file name holds no quote.
  if (!text.startsWith(u'"')) return std::nullopt;
  const qsizetype close = text.indexOf(u'"', 1);
  if (close < 2 || close + 2 >= text.size() || text[close + 1] != u':') return std::nullopt;
  const QStringView digits = text.mid(close + 2);
  bool valid = false;
  const qulonglong offset = digits.toULongLong(&valid, 16);
  if (!valid || offset > std::numeric_limits<quint32>::max()) return std::nullopt;
  reference.fileName = text.mid(1, close - 1).toString();
  reference.offset = static_cast<quint32>(offset);
  return reference;
}

QString formatFrxReference(const FrxReference& reference) {
  QString offset = QString::number(reference.offset, 16).toUpper();
  if (offset.size() < 4) offset.prepend(QString(4 - offset.size(), u'0'));
  return (reference.longText ? QStringLiteral("$\"") : QStringLiteral("\"")) + reference.fileName +
         QStringLiteral("\":") + offset;
}

FrxRecordKind frxRecordKind(QStringView className, QStringView propertyName, bool longText) {
  if (longText) return FrxRecordKind::Text;
  if (propertyName.compare(u"List", Qt::CaseInsensitive) == 0) return FrxRecordKind::List;
  if (propertyName.compare(u"ItemData", Qt::CaseInsensitive) == 0) return FrxRecordKind::ItemData;
  if (isPictureProperty(propertyName)) return FrxRecordKind::Picture;
  const PropertyInfo* info = findPropertyInfo(className, propertyName);
  if (info && info->type == PropertyType::String) return FrxRecordKind::Text;
  // The common string properties of controls the tables do not know (an ActiveX control's Caption).
  for (const char* text : {"Caption", "Text", "ToolTipText", "Tag"}) {
    if (!info && propertyName.compare(QLatin1StringView(text), Qt::CaseInsensitive) == 0)
      return FrxRecordKind::Text;
  }
  return FrxRecordKind::Other;
}

QString pictureKind(QByteArrayView picture) {
  const auto startsWith = [&](std::initializer_list<unsigned char> bytes) {
    if (picture.size() < static_cast<qsizetype>(bytes.size())) return false;
    return std::equal(bytes.begin(), bytes.end(), picture.begin(),
                      [](unsigned char a, char b) { return a == static_cast<unsigned char>(b); });
  };
  if (startsWith({0, 0, 1, 0}) || startsWith({0, 0, 2, 0})) return QStringLiteral("Icon");
  const bool emf =
      startsWith({1, 0, 0, 0}) && picture.size() > 44 && std::memcmp(picture.data() + 40, " EMF", 4) == 0;
  if (startsWith({0xD7, 0xCD, 0xC6, 0x9A}) || startsWith({1, 0, 9, 0}) || startsWith({2, 0, 9, 0}) || emf)
    return QStringLiteral("Metafile");
  return QStringLiteral("Bitmap");
}

std::optional<QByteArray> encodeFrxText(QStringView text) {
  const std::optional<QByteArray> bytes = encodeAnsi(text);
  if (!bytes) return std::nullopt;
  QByteArray record;
  record.reserve(4 + bytes->size());
  appendNumber(record, static_cast<quint32>(bytes->size()), 4);
  record.append(*bytes);
  return record;
}

std::optional<QByteArray> encodeFrxList(const QStringList& items, std::optional<quint16> secondField) {
  if (items.size() > 0xFFFF) return std::nullopt;
  QByteArray record;
  appendNumber(record, static_cast<quint32>(items.size()), 2);
  // The field after the count has been seen to repeat it; one read from the file is kept as it was.
  appendNumber(record, secondField.value_or(static_cast<quint16>(items.size())), 2);
  for (const QString& item : items) {
    const std::optional<QByteArray> bytes = encodeAnsi(item);
    if (!bytes || bytes->size() > 0xFFFF) return std::nullopt;
    appendNumber(record, static_cast<quint32>(bytes->size()), 2);
    record.append(*bytes);
  }
  return record;
}

QByteArray encodeFrxPicture(QByteArrayView picture) {
  QByteArray record;
  record.reserve(kPictureHeader + picture.size());
  appendNumber(record, static_cast<quint32>(picture.size() + 8), 4);
  record.append(kPictureSignature, sizeof kPictureSignature);
  appendNumber(record, static_cast<quint32>(picture.size()), 4);
  record.append(picture.data(), picture.size());
  return record;
}

// --- FrxFile ---------------------------------------------------------------------------------------------

std::optional<quint32> FrxFile::number(qsizetype at, int size) const {
  if (at < 0 || at + size > m_bytes.size()) return std::nullopt;
  quint32 value = 0;
  for (int i = size - 1; i >= 0; --i)
    value = (value << 8) | static_cast<unsigned char>(m_bytes[at + i]);
  return value;
}

std::optional<QByteArrayView> FrxFile::span(qsizetype at, qsizetype length) const {
  if (at < 0 || length < 0 || at > m_bytes.size()) return std::nullopt;
  const qsizetype available = m_bytes.size() - at;
  if (length > available + 1) return std::nullopt;
  return QByteArrayView(m_bytes).sliced(at, std::min(length, available));
}

std::optional<std::pair<qsizetype, qsizetype>> FrxFile::textBounds(const FrxReference& reference) const {
  const qsizetype at = reference.offset;
  if (reference.longText) {
    const auto length = number(at, 4);
    if (!length) return std::nullopt;
    return std::pair<qsizetype, qsizetype>(at + 4, *length);
  }
  const auto first = number(at, 1);
  if (!first) return std::nullopt;
  if (*first != 0xFF) return std::pair<qsizetype, qsizetype>(at + 1, *first);
  const auto wide = number(at + 1, 2);
  if (!wide) return std::nullopt;
  if (*wide != 0xFFFF) return std::pair<qsizetype, qsizetype>(at + 3, *wide);
  const auto longest = number(at + 3, 4);
  if (!longest) return std::nullopt;
  return std::pair<qsizetype, qsizetype>(at + 7, *longest);
}

std::optional<QString> FrxFile::text(const FrxReference& reference) const {
  const auto bounds = textBounds(reference);
  if (!bounds) return std::nullopt;
  const auto bytes = span(bounds->first, bounds->second);
  return bytes ? std::optional(decodeAnsi(*bytes)) : std::nullopt;
}

std::optional<QStringList> FrxFile::list(quint32 offset) const {
  const auto count = number(offset, 2);
  if (!count) return std::nullopt;
  QStringList items;
  qsizetype at = offset + kListHeader;
  for (quint32 i = 0; i < *count; ++i) {
    const auto length = number(at, 2);
    if (!length || at + 2 + *length > m_bytes.size()) return std::nullopt;
    items.append(decodeAnsi(QByteArrayView(m_bytes).sliced(at + 2, *length)));
    at += 2 + *length;
  }
  return items;
}

std::optional<QList<qint32>> FrxFile::itemData(quint32 offset) const {
  const auto count = number(offset, 2);
  if (!count || offset + kListHeader + 4 * qsizetype(*count) > m_bytes.size()) return std::nullopt;
  QList<qint32> values;
  for (quint32 i = 0; i < *count; ++i)
    values.append(static_cast<qint32>(*number(offset + kListHeader + 4 * i, 4)));
  return values;
}

std::optional<quint16> FrxFile::listSecondField(quint32 offset) const {
  const auto field = number(qsizetype(offset) + 2, 2);
  return field ? std::optional(static_cast<quint16>(*field)) : std::nullopt;
}

std::optional<QByteArray> FrxFile::picture(quint32 offset) const {
  const auto dataSize = number(qsizetype(offset) + 8, 4);
  // The size field was read, so the signature before it is in the file.
  if (!dataSize || std::memcmp(m_bytes.constData() + offset + 4, kPictureSignature, 4) != 0)
    return std::nullopt;
  const auto bytes = span(qsizetype(offset) + kPictureHeader, *dataSize);
  return bytes ? std::optional(bytes->toByteArray()) : std::nullopt;
}

std::optional<qsizetype> FrxFile::recordLength(const FrxReference& reference, FrxRecordKind kind) const {
  auto length = headerLength(reference, kind);
  const qsizetype at = reference.offset;
  if (length && at + *length > m_bytes.size()) {
    if (at + *length - 1 != m_bytes.size()) return std::nullopt;
    *length -= 1;
  }
  return length;
}

bool FrxFile::readsPastEnd(const FrxReference& reference, FrxRecordKind kind) const {
  if (kind == FrxRecordKind::Other) return false;
  const auto length = headerLength(reference, kind);
  return !length || qsizetype(reference.offset) + *length > m_bytes.size();
}

std::optional<qsizetype> FrxFile::headerLength(const FrxReference& reference, FrxRecordKind kind) const {
  const quint32 offset = reference.offset;
  const qsizetype at = offset;
  std::optional<qsizetype> length;
  switch (kind) {
    case FrxRecordKind::Text:
      if (const auto bounds = textBounds(reference)) length = bounds->first + bounds->second - at;
      break;
    case FrxRecordKind::List: {
      const auto count = number(at, 2);
      if (!count) break;
      qsizetype end = at + kListHeader;
      for (quint32 i = 0; i < *count; ++i) {
        const auto item = number(end, 2);
        if (!item) return std::nullopt;
        end += 2 + *item;
      }
      length = end - at;
      break;
    }
    case FrxRecordKind::ItemData:
      if (const auto count = number(at, 2)) length = kListHeader + 4 * qsizetype(*count);
      break;
    case FrxRecordKind::Picture:
      if (picture(offset))
        if (const auto size = number(at + 8, 4)) length = kPictureHeader + qsizetype(*size);
      break;
    case FrxRecordKind::Other:
      break;
  }
  return length;
}

// --- Rebuilding ------------------------------------------------------------------------------------------

std::vector<FrxProperty> frxProperties(FormNode& root) {
  std::vector<FrxProperty> found;
  std::map<std::pair<const PropertyGroup*, QString>, int> seen;
  root.forEachProperty([&](PropertyGroup& group, FormNode& owner, QStringView name, QStringView value) {
    const int occurrence = seen[{&group, name.toString().toLower()}]++;
    if (auto reference = parseFrxReference(value))
      found.push_back({&group, &owner, name.toString(), std::move(*reference), occurrence});
  });
  return found;
}

std::map<quint32, qsizetype> frxRecordEnds(FormNode& root, const FrxFile& file) {
  const std::vector<FrxProperty> properties = frxProperties(root);
  std::set<quint32> starts;
  for (const FrxProperty& property : properties)
    starts.insert(property.reference.offset);
  std::map<quint32, qsizetype> ends;
  for (const FrxProperty& property : properties) {
    const quint32 offset = property.reference.offset;
    if (offset >= file.bytes().size()) continue;
    const auto next = starts.upper_bound(offset);
    // A record whose header gives its length ends there, even where another record starts inside it (a
    // damaged file): cut at that start, it would read back as another value.
    const FrxRecordKind kind =
        frxRecordKind(property.owner->className(), property.name, property.reference.longText);
    qsizetype end =
        next == starts.end() ? file.bytes().size() : std::min<qsizetype>(*next, file.bytes().size());
    if (file.readsPastEnd(property.reference, kind))
      end = file.bytes().size();  // it reads what follows it, up to the end of the file
    else if (const auto length = file.recordLength(property.reference, kind))
      end = offset + *length;
    auto [slot, added] = ends.emplace(offset, end);
    if (!added) slot->second = std::max(slot->second, end);
  }
  return ends;
}

QByteArray rebuildFrx(FormNode& root, const FrxFile& old, const std::map<quint32, qsizetype>& ends,
                      const QString& fileName, const PropertyGroup* changedGroup, QStringView changedName,
                      const QByteArray& changedRecord, const QString& displayName) {
  std::vector<FrxProperty> properties = frxProperties(root);
  // The old bytes each unchanged record reads. Records that share bytes (damaged files: one starting inside
  // another, two lines referring to one offset) are copied together, once, so that each reads back what
  // it read before; those that read up to the end of the file go last, so that they still end there.
  struct Group {
    qsizetype from = 0;
    qsizetype to = 0;
    bool atEnd = false;
    std::size_t first = 0;  // the description index of its first record
  };
  std::vector<Group> groups;
  std::vector<std::ptrdiff_t> groupOf(properties.size(), -1);  // -1: the changed record
  std::vector<std::size_t> byStart;
  for (std::size_t i = 0; i < properties.size(); ++i) {
    const FrxProperty& property = properties[i];
    if (property.group == changedGroup && property.name.compare(changedName, Qt::CaseInsensitive) == 0)
      continue;
    if (!ends.contains(property.reference.offset)) {
      throw ide::Error(ide::err::InvalidFileFormat,
                       QStringLiteral("%1: the value of %2.%3 at offset %4 is not in the file")
                           .arg(displayName, property.owner->name(), property.name)
                           .arg(property.reference.offset, 4, 16, QLatin1Char('0')));
    }
    byStart.push_back(i);
  }
  std::stable_sort(byStart.begin(), byStart.end(), [&](std::size_t a, std::size_t b) {
    return properties[a].reference.offset < properties[b].reference.offset;
  });
  for (const std::size_t i : byStart) {
    const FrxReference& reference = properties[i].reference;
    const qsizetype from = reference.offset;
    const qsizetype to = ends.at(reference.offset);
    const bool atEnd = old.readsPastEnd(
        reference, frxRecordKind(properties[i].owner->className(), properties[i].name, reference.longText));
    if (groups.empty() || from >= groups.back().to) {
      groups.push_back({from, to, atEnd, i});
    } else {
      Group& group = groups.back();
      group.to = std::max(group.to, to);
      group.atEnd = group.atEnd || atEnd;
      group.first = std::min(group.first, i);
    }
    groupOf[i] = std::ptrdiff_t(groups.size() - 1);
  }
  std::vector<std::size_t> order(groups.size());
  for (std::size_t g = 0; g < groups.size(); ++g)
    order[g] = g;
  std::stable_sort(order.begin(), order.end(), [&](std::size_t a, std::size_t b) {
    if (groups[a].atEnd != groups[b].atEnd) return groups[b].atEnd;
    return groups[a].first < groups[b].first;
  });

  // In description order: each group where its first record is described, the changed record at its line.
  QByteArray bytes;
  std::vector<qsizetype> groupStart(groups.size(), -1);
  std::vector<qsizetype> changedAt(properties.size(), -1);
  std::size_t nextGroup = 0;
  const auto placeGroupsUpTo = [&](std::size_t index) {
    while (nextGroup < order.size() && !groups[order[nextGroup]].atEnd &&
           groups[order[nextGroup]].first <= index) {
      const Group& group = groups[order[nextGroup]];
      groupStart[order[nextGroup]] = bytes.size();
      bytes.append(old.bytes().mid(group.from, group.to - group.from));
      ++nextGroup;
    }
  };
  for (std::size_t i = 0; i < properties.size(); ++i) {
    placeGroupsUpTo(i);
    if (groupOf[i] < 0) {
      changedAt[i] = bytes.size();
      bytes.append(changedRecord);
    }
  }
  for (; nextGroup < order.size(); ++nextGroup) {
    const Group& group = groups[order[nextGroup]];
    groupStart[order[nextGroup]] = bytes.size();
    bytes.append(old.bytes().mid(group.from, group.to - group.from));
  }

  for (std::size_t i = 0; i < properties.size(); ++i) {
    FrxProperty& property = properties[i];
    const qsizetype offset = groupOf[i] < 0 ? changedAt[i]
                                            : groupStart[size_t(groupOf[i])] + property.reference.offset -
                                                  groups[size_t(groupOf[i])].from;
    property.group->setPropertyAt(
        property.name, property.occurrence,
        formatFrxReference({fileName, static_cast<quint32>(offset), property.reference.longText}));
  }
  return bytes;
}

}  // namespace host
