// SPDX-License-Identifier: MIT
#include "ide/error.h"

namespace ide {

Error::Error(long number, QString description, QString source)
    : m_number(number),
      m_description(std::move(description)),
      m_source(std::move(source)),
      m_what(QString::number(number).append(u' ').append(m_description).toStdString()) {}

// Out of line so that the type's identity lives in one shared library for every module that catches it.
Error::~Error() = default;

QString standardDescription(long number) {
  switch (number) {
    case err::InvalidProcedureCall:
      return QStringLiteral("Invalid procedure call or argument");
    case err::SubscriptOutOfRange:
      return QStringLiteral("Subscript out of range");
    case err::SubOrFunctionNotDefined:
      return QStringLiteral("Sub or Function not defined");
    case err::BadFileNameOrNumber:
      return QStringLiteral("Bad file name or number");
    case err::FileNotFound:
      return QStringLiteral("File not found");
    case err::PermissionDenied:
      return QStringLiteral("Permission denied");
    case err::PathFileAccessError:
      return QStringLiteral("Path/File access error");
    case err::PathNotFound:
      return QStringLiteral("Path not found");
    case err::ObjectVariableNotSet:
      return QStringLiteral("Object variable or With block variable not set");
    case err::InvalidFileFormat:
      return QStringLiteral("Invalid file format");
    case err::ObjectRequired:
      return QStringLiteral("Object required");
    case err::NameConflict:
      return QStringLiteral("Name conflicts with existing module, project, or object library");
    case err::InvalidName:
      return QStringLiteral("Invalid name");
    case err::LineTooLong:
      return QStringLiteral("Line too long");
    case err::CannotEdit:
      return QStringLiteral("Module cannot be edited");
    default:
      return {};
  }
}

void raise(long number, const QString& description, const QString& source) {
  throw Error(number, description.isEmpty() ? standardDescription(number) : description, source);
}

}  // namespace ide
