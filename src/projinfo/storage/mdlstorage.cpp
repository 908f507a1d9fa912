// SPDX-License-Identifier: MIT
#include "projinfo/storage/mdlstorage.h"

#include "common/errors.h"
#include "ide/error.h"

#include <QFileInfo>
#include <QtEndian>

#include <cstring>
#include <vector>

namespace projinfo {
namespace {

constexpr quint16 kAnsiCodePage = 1252;
constexpr quint16 kUnicodeCodePage = 1200;
constexpr quint32 kPidCodePage = 1;
constexpr quint16 kVtI2 = 2;
/// The platform a property set says it was written on: 32-bit Windows, version 5.1.
constexpr quint32 kSystemIdentifier = 0x00020105;

/// A property-set stream holding one empty section per format (the code page is all it says).
QByteArray propertySetStream(const std::vector<QUuid>& formats, quint16 codePage) {
  const qsizetype header = 28 + 20 * qsizetype(formats.size());
  constexpr qsizetype kSection = 24;  // size, count, one identifier-offset pair, the code page
  QByteArray bytes(header + kSection * qsizetype(formats.size()), '\0');
  char* p = bytes.data();
  qToLittleEndian<quint16>(0xFFFE, p);
  qToLittleEndian<quint32>(kSystemIdentifier, p + 4);
  qToLittleEndian<quint32>(static_cast<quint32>(formats.size()), p + 24);
  for (size_t i = 0; i < formats.size(); ++i) {
    char* entry = p + 28 + 20 * i;
    qToLittleEndian<quint32>(formats[i].data1, entry);
    qToLittleEndian<quint16>(formats[i].data2, entry + 4);
    qToLittleEndian<quint16>(formats[i].data3, entry + 6);
    std::memcpy(entry + 8, formats[i].data4, 8);
    const qsizetype offset = header + kSection * qsizetype(i);
    qToLittleEndian<quint32>(static_cast<quint32>(offset), entry + 16);
    char* section = p + offset;
    qToLittleEndian<quint32>(kSection, section);
    qToLittleEndian<quint32>(1, section + 4);
    qToLittleEndian<quint32>(kPidCodePage, section + 8);
    qToLittleEndian<quint32>(16, section + 12);
    qToLittleEndian<quint16>(kVtI2, section + 16);
    qToLittleEndian<quint16>(codePage, section + 20);
  }
  return bytes;
}

std::shared_ptr<Storage> rootOf(std::shared_ptr<DocFile> file, qint32 mode) {
  auto root = file->root();
  return Storage::bind({std::move(file), std::move(root)}, mode);
}

}  // namespace

std::shared_ptr<Storage> OpenOrCreateDocFile(const QString& FileName, bool& IsNew, bool AnsiFlag,
                                             bool Overwrite) {
  std::shared_ptr<Storage> root;
  try {
    try {
      root = rootOf(DocFile::create(FileName, Overwrite), kElementMode | STGM_CREATE);
    } catch (const ide::Error& error) {
      if (error.number() != stg::ElementExists) throw;
      root = rootOf(DocFile::open(FileName, DocFile::Access::ReadWrite), kElementMode);
      IsNew = false;
    }
  } catch (const ide::Error& failure) {
    common::recordErrorNumber(failure);
    return Storage::unbound(failure);
  }
  if (IsNew) {
    CreatePropertySets(root, AnsiFlag);
    try {
      root->Commit(0);
    } catch (const ide::Error&) {
      // Kept in memory; the owner's next commit tries again and reports.
    }
  }
  return root;
}

std::shared_ptr<Storage> OpenDocFileForReading(const QString& FileName) {
  return rootOf(DocFile::open(FileName, DocFile::Access::Read), STGM_READ);
}

bool CreatePropertySets(const std::shared_ptr<Storage>& storage, bool AnsiFlag) {
  const quint16 codePage = AnsiFlag ? kAnsiCodePage : kUnicodeCodePage;
  constexpr qint32 kMode = STGM_CREATE | kElementMode;
  bool ok = true;
  const std::pair<const char16_t*, std::vector<QUuid>> sets[] = {
      {u"\x05SummaryInformation", {QUuid(kSummaryInformation)}},
      {u"\x05"
       "DocumentSummaryInformation",
       {QUuid(kDocSummaryInformation), QUuid(kUserDefinedProperties)}},
  };
  for (const auto& [name, formats] : sets) {
    try {
      auto stream = storage->CreateStream(QString::fromUtf16(name), kMode);
      stream->SetSize(0);
      stream->WriteBuf(propertySetStream(formats, codePage));
    } catch (const std::exception& failure) {
      common::recordErrorNumber(failure);
      ok = false;
    }
  }
  return ok;
}

QString GetSystemErrorText(long number) {
  static const std::pair<long, const char*> kTexts[] = {
      {stg::InvalidFunction, "Unable to perform requested operation."},
      {stg::FileNotFound, "The file or element could not be found."},
      {stg::PathNotFound, "The path could not be found."},
      {stg::AccessDenied, "Access denied."},
      {stg::InvalidHandle, "Attempted an operation on an invalid object."},
      {stg::WriteFault, "A disk error occurred during a write operation."},
      {stg::ReadFault, "A disk error occurred during a read operation."},
      {stg::ShareViolation, "A share violation has occurred."},
      {stg::LockViolation, "A lock violation has occurred."},
      {stg::FileAlreadyExists, "The element already exists."},
      {stg::InvalidParameter, "Invalid parameter error."},
      {stg::Reverted,
       "The object has been invalidated by a revert operation above it in the transaction tree."},
      {stg::InvalidHeader, "The compound file was not a valid compound file."},
      {stg::InvalidName, "The name is not valid."},
      {stg::DocFileCorrupt, "The compound file has been corrupted."},
      {stg::NoInterface, "No such interface supported."},
      {static_cast<qint32>(0x80040154u), "Class not registered."},
  };
  for (const auto& [code, text] : kTexts)
    if (code == number) return QString::fromLatin1(text);
  if (number > 0 && number < 4096) {
    const QString standard = ide::standardDescription(number);
    if (!standard.isEmpty()) return standard;
    return QString::fromLocal8Bit(std::strerror(static_cast<int>(number)));
  }
  return QStringLiteral("Unknown error 0x%1.").arg(static_cast<quint32>(number), 8, 16, QChar(u'0'));
}

}  // namespace projinfo
