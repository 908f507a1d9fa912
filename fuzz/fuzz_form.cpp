// SPDX-License-Identifier: MIT
// A form description with its binary file: the input is the .frm up to its first NUL byte, the .frx after
// it. Invariants: the form file is written back byte for byte; rebuilding the binary file with nothing
// edited changes no value that a property line refers to, and no property line other than the references'
// offsets.
#include "fuzzcommon.h"

#include "host/files/frxfile.h"
#include "host/files/modulefile.h"
#include "ide/error.h"

#include <QStringList>
#include <QVariant>

namespace {

/// Every property line as "name=value", references replaced by the value of their record.
QStringList values(host::FormNode& root, const host::FrxFile& frx) {
  QStringList found;
  root.forEachProperty([&](host::PropertyGroup&, host::FormNode& owner, QStringView name, QStringView value) {
    QString shown = name.toString() + u'=';
    const auto reference = host::parseFrxReference(value);
    if (!reference) {
      found << shown + value.toString();
      return;
    }
    switch (host::frxRecordKind(owner.className(), name, reference->longText)) {
      case host::FrxRecordKind::Text:
        shown += frx.text(*reference).value_or(u"(none)"_qs);
        break;
      case host::FrxRecordKind::List:
        shown += frx.list(reference->offset).value_or(QStringList{u"(none)"_qs}).join(u'|');
        shown += QString::number(frx.listSecondField(reference->offset).value_or(0));
        break;
      case host::FrxRecordKind::ItemData:
        for (const qint32 number : frx.itemData(reference->offset).value_or(QList<qint32>{-1, -1}))
          shown += QString::number(number) + u',';
        break;
      case host::FrxRecordKind::Picture:
        shown += QString::fromLatin1(frx.picture(reference->offset).value_or("(none)").toHex());
        break;
      case host::FrxRecordKind::Other:
        shown += u"(other)";  // its bytes run to the next record, wherever that is
        break;
    }
    found << shown;
  });
  return found;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  if (size > 64 * 1024) return 0;
  const QByteArray input = fuzz::bytesOf(data, size);
  const qsizetype split = input.indexOf('\0');
  const QByteArray form = split < 0 ? input : input.left(split);
  const host::FrxFile binary(split < 0 ? QByteArray() : input.mid(split + 1));
  host::ModuleSource source;
  try {
    source = host::parseModule(form, QStringLiteral("Fuzz.frm"));
  } catch (const ide::Error&) {
    return 0;
  }
  fuzz::check(host::writeModule(source, QStringLiteral("Fuzz.frm")) == form,
              "a form file is written back as read");
  if (!source.form) return 0;
  host::FormNode& root = source.form->root();
  const QStringList before = values(root, binary);
  const auto ends = host::frxRecordEnds(root, binary);
  QByteArray rebuilt;
  try {
    rebuilt = host::rebuildFrx(root, binary, ends, QStringLiteral("Fuzz.frx"), nullptr, {}, {},
                               QStringLiteral("Fuzz.frx"));
  } catch (const ide::Error&) {
    return 0;  // a record the description refers to is not in the file
  }
  fuzz::check(values(root, host::FrxFile(rebuilt)) == before,
              "a rebuild with nothing edited keeps every value");
  return 0;
}
