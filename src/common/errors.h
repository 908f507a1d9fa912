// SPDX-License-Identifier: MIT
// The add-in's error convention. A procedure that fails records the error in the process-wide last-error
// record with its place, shown as "em <module>_<procedure>, linha: <n>" (kept when the error already
// carries one from a nested procedure), and raises it again as a LocatedError; the outermost
// handler shows it with ShowErrorReport. Every reported location is also appended to a log file in the
// user's data directory, for bug reports.
#pragma once

#include "ide/error.h"
#include "ide/platform.h"

#include <QString>

#include <exception>

namespace common {

/// The add-in's own cancel code, and the common dialogs' one: both end silently.
inline constexpr long kCancelled = 9999;
inline constexpr long kCommonDialogCancelled = 32755;

/// Where a failure was caught: the add-in's module, procedure and line.
struct Place {
  QString module;
  QString procedure;
  int line = 0;
  /// "em " + module + "_" + procedure + ", linha: " + line, as reports and the log show it.
  QString text() const;
  bool operator==(const Place&) const = default;
};

/// A failure that has passed a handler of the convention: it carries the place where it was first
/// caught, kept by every handler it passes afterwards. The source is the place's text.
class LocatedError : public ide::Error {
 public:
  LocatedError(long number, QString description, Place place);
  const Place& place() const noexcept { return m_place; }

 private:
  Place m_place;
};

struct LastError {
  long number = 0;
  QString description;
  Place place;
};

/// The process-wide last-error record.
LastError& lastError();

/// Records a failure caught in module_procedure at `line` and returns the error to raise again: same
/// number and description, the innermost place.
LocatedError recordError(const std::exception& failure, const QString& module, const QString& procedure,
                         int line);

/// Records only the number of a failure that is swallowed (the timer's), keeping the rest of the record.
void recordErrorNumber(const std::exception& failure);

/// Shows the last error ("<number> <description>", OK only) unless it is a cancel code, and logs it.
void ShowErrorReport(ide::UserInterface& ui);

/// Appends the last error with its location to the log, for handlers that show a fixed message instead.
void logLastError();

/// Logs, with its location, a failure that the user is not told of (or only by a fixed message), leaving
/// the last-error record as it is. The same failure at the same place as the one logged just before is not
/// logged again, so that a timer failing at every tick leaves one line.
void logFailure(const std::exception& failure, const QString& module, const QString& procedure, int line);

/// Where reported locations are logged ($QUIMBEL_DATA_DIR or the user's data directory, file errors.log).
QString errorLogPath();

}  // namespace common
