// SPDX-License-Identifier: MIT
// The record text of a task or a favourite: one string of fields, each its key ("[Name](" ...), its value
// and a closing parenthesis, nothing between them. A field is read by finding the first occurrence of its
// key and taking the text up to the next ")".
//
// That alone cannot hold a value with ")" (it would end early) or with a key in it ("[Done](" in a name
// would be found before the real field). Records written here therefore begin with the marker field
// "[Escaped](1)" and write "%", "[" and ")" in values as "%25", "%5B" and "%29", so that no key can occur
// inside a value. Records without the marker are read exactly as before, so files written by earlier
// versions keep their meaning; programs that do not know the marker ignore it, as they ignore any text
// between fields.
#pragma once

#include <QString>

#include <optional>
#include <utility>
#include <vector>

namespace projinfo {

inline constexpr char kEscapedMarker[] = "[Escaped](1)";

/// Keys and values in the order they are written.
using RecordFields = std::vector<std::pair<const char*, QString>>;

/// The record text of `fields`, escaped and marked.
QString writeRecord(const RecordFields& fields);

/// One record text, read field by field.
class RecordText {
 public:
  explicit RecordText(QString text);
  /// The field's value; empty when the record has no such key.
  std::optional<QString> value(const char* key) const;
  /// Raise ide::Error 13 (type mismatch) for a missing field or a value that is not a number, 6 for one
  /// that does not fit 32 bits. Booleans are -1 or 0 (any other number is true), or True or False.
  QString text(const char* key) const;
  qint32 number(const char* key) const;
  bool boolean(const char* key) const;

 private:
  QString m_text;
  bool m_escaped;
};

/// A task record: "[Name](...)[Text](...)[Done](-1 or 0)[ItemId](...)".
struct TaskRecord {
  QString Name;
  QString Text;
  bool Done = false;
  qint32 ItemId = 0;

  QString toText() const;
  /// Raises as RecordText does.
  static TaskRecord fromText(const QString& text);
};

/// A favourite record: "[ComponentName](...)[ProcedureName](...)[ProcKind](...)[ItemId](...)[Line](...)".
struct FavoriteRecord {
  QString ComponentName;
  QString ProcedureName;
  qint32 ProcKind = 0;
  qint32 ItemId = 0;
  qint32 Line = 0;

  QString toText() const;
  static FavoriteRecord fromText(const QString& text);
};

}  // namespace projinfo
