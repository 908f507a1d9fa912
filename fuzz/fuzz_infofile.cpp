// SPDX-License-Identifier: MIT
// A project's info file: the compound-file reader, the typed reads of its streams and the task and
// favourite records. Invariants: what was read is written, and reading that back and writing it again
// gives the same bytes; a record read and written again reads back the same.
#include "fuzzcommon.h"

#include "ide/error.h"
#include "projinfo/records.h"
#include "projinfo/storage/compoundfile.h"
#include "projinfo/storage/storage.h"

#include <vector>

namespace {

using projinfo::Element;

template <typename Record>
void checkRecord(const QString& text) {
  try {
    const Record record = Record::fromText(text);
    const QString written = record.toText();
    fuzz::check(Record::fromText(written).toText() == written, "a record written again reads back the same");
  } catch (const ide::Error&) {
  }
}

/// Reads the stream's bytes as each type the add-in reads, and its text as a task and a favourite record.
void readStream(const std::shared_ptr<Element>& element) {
  const auto stream = projinfo::Stream::bind({nullptr, element}, projinfo::STGM_READ);
  for (const qint32 type :
       {projinfo::vbInteger, projinfo::vbLong, projinfo::vbSingle, projinfo::vbDouble, projinfo::vbCurrency,
        projinfo::vbDate, projinfo::vbString, projinfo::vbBoolean, projinfo::vbByte}) {
    stream->SSeek(0);
    try {
      const QVariant value = stream->ReadData(type);
      if (type == projinfo::vbString) {
        checkRecord<projinfo::TaskRecord>(value.toString());
        checkRecord<projinfo::FavoriteRecord>(value.toString());
      }
    } catch (const ide::Error&) {
    }
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  if (size > 1024 * 1024) return 0;
  const QByteArray bytes = fuzz::bytesOf(data, size);
  std::shared_ptr<Element> root;
  try {
    root = projinfo::readCompoundFile(bytes);
  } catch (const ide::Error&) {
    return 0;  // not a compound file, or a damaged one: refused with what is wrong
  }
  // Without recursion: a damaged file's tree may be deep.
  std::vector<std::shared_ptr<Element>> pending{root};
  while (!pending.empty()) {
    const std::shared_ptr<Element> storage = pending.back();
    pending.pop_back();
    for (const auto& [key, child] : storage->children) {
      if (child->isStorage())
        pending.push_back(child);
      else
        readStream(child);
    }
  }
  QByteArray written;
  try {
    written = projinfo::writeCompoundFile(*root);
  } catch (const ide::Error&) {
    return 0;  // too large or too deep for the format
  }
  std::shared_ptr<Element> again;
  try {
    again = projinfo::readCompoundFile(written);
  } catch (const ide::Error&) {
    fuzz::check(false, "a written file reads back");
  }
  fuzz::check(projinfo::writeCompoundFile(*again) == written, "a file read back is written the same");
  return 0;
}
