// SPDX-License-Identifier: MIT
#include "common/errors.h"

#include "common/strings.h"

#include <QDateTime>
#include <QDir>
#include <QFile>
#include <QStandardPaths>

namespace common {

LastError& lastError() {
  // Per thread: the IDE's user-interface thread is the only one in the add-in, and the command-line
  // tool's parallel walks each keep their own.
  thread_local LastError record;
  return record;
}

QString Place::text() const {
  if (module.isEmpty() && procedure.isEmpty()) return {};  // no place recorded
  return QStringLiteral("em %1_%2, linha: %3").arg(module, procedure).arg(line);
}

LocatedError::LocatedError(long number, QString description, Place place)
    : ide::Error(number, std::move(description), place.text()), m_place(std::move(place)) {}

namespace {
long numberOf(const std::exception& failure) {
  const auto* error = dynamic_cast<const ide::Error*>(&failure);
  return error ? error->number() : ide::err::InvalidProcedureCall;  // not the IDE's: an invalid call
}

/// The record of a failure caught at module_procedure, line: the innermost place wins.
LastError describe(const std::exception& failure, const Place& here) {
  const auto* error = dynamic_cast<const ide::Error*>(&failure);
  const auto* located = dynamic_cast<const LocatedError*>(&failure);
  return {numberOf(failure), error ? error->description() : QString::fromLocal8Bit(failure.what()),
          located ? located->place() : here};
}
}  // namespace

void recordErrorNumber(const std::exception& failure) {
  lastError().number = numberOf(failure);
}

LocatedError recordError(const std::exception& failure, const QString& module, const QString& procedure,
                         int line) {
  LastError& record = lastError();
  record = describe(failure, Place{module, procedure, line});
  return LocatedError(record.number, record.description, record.place);
}

QString errorLogPath() {
  const QString overridden = qEnvironmentVariable("QUIMBEL_DATA_DIR");
  const QString dir =
      !overridden.isEmpty()
          ? overridden
          : QStandardPaths::writableLocation(QStandardPaths::GenericDataLocation) + u'/' + title();
  return QDir(dir).filePath(QStringLiteral("errors.log"));
}

namespace {
void appendToLog(const LastError& record) {
  const QString path = errorLogPath();
  QDir().mkpath(QFileInfo(path).path());
  QFile log(path);
  if (!log.open(QIODevice::Append | QIODevice::Text)) return;  // the report itself must not fail
  log.write(QStringLiteral("%1\t%2\t%3\t%4\n")
                .arg(QDateTime::currentDateTime().toString(Qt::ISODate))
                .arg(record.number)
                .arg(record.description, record.place.text())
                .toUtf8());
}
}  // namespace

void logLastError() {
  appendToLog(lastError());
}

void logFailure(const std::exception& failure, const QString& module, const QString& procedure, int line) {
  LastError record = describe(failure, Place{module, procedure, line});
  thread_local LastError previous;
  if (record.number == previous.number && record.description == previous.description &&
      record.place == previous.place)
    return;
  appendToLog(record);
  previous = std::move(record);
}

void ShowErrorReport(ide::UserInterface& ui) {
  const LastError& record = lastError();
  if (record.number == kCancelled || record.number == kCommonDialogCancelled) return;
  appendToLog(record);
  ui.MsgBox(QStringLiteral("%1 %2").arg(record.number).arg(record.description), ide::mb::OKOnly, title());
}

}  // namespace common
