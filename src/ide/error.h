// SPDX-License-Identifier: MIT
// The single failure type of the object model: an error number, a description and a source, as the IDE
// reports them. Callers build their error convention (location texts, re-raising) on these three fields.
#pragma once

#include <QString>

#include <exception>
#include <string>

namespace ide {

/// Error numbers the object model raises. Where the IDE has a number, it is the IDE's.
namespace err {
inline constexpr long InvalidProcedureCall = 5;      // bad argument
inline constexpr long SubscriptOutOfRange = 9;       // item or line index outside the collection
inline constexpr long SubOrFunctionNotDefined = 35;  // procedure name or kind not in the module
inline constexpr long FileNotFound = 53;
inline constexpr long BadFileNameOrNumber = 52;
inline constexpr long PermissionDenied = 70;
inline constexpr long PathFileAccessError = 75;
inline constexpr long PathNotFound = 76;
inline constexpr long ObjectVariableNotSet = 91;  // call on an object that left the IDE (removed)
inline constexpr long InvalidFileFormat = 321;
inline constexpr long ObjectRequired = 424;
inline constexpr long NameConflict = 35010;  // a project or component name already in use
inline constexpr long InvalidName = 35011;   // not a valid identifier
inline constexpr long LineTooLong = 35020;   // a physical line over the IDE's 1023 characters
inline constexpr long CannotEdit = 40198;    // the module cannot be edited
}  // namespace err

/// Thrown by every object-model operation that fails.
class Error : public std::exception {
 public:
  Error(long number, QString description, QString source = {});
  ~Error() override;

  long number() const noexcept { return m_number; }
  const QString& description() const noexcept { return m_description; }
  const QString& source() const noexcept { return m_source; }

  const char* what() const noexcept override { return m_what.c_str(); }

 private:
  long m_number;
  QString m_description;
  QString m_source;
  std::string m_what;
};

/// The IDE's standard description for an error number it raises, or an empty text.
QString standardDescription(long number);

/// Throws Error(number, standardDescription(number) or the given text, source).
[[noreturn]] void raise(long number, const QString& description = {}, const QString& source = {});

}  // namespace ide
