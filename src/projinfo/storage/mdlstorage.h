// SPDX-License-Identifier: MIT
// Whole compound files: creating or opening one as a Storage on its root, its three empty property sets,
// and the platform's message texts for the storage failure codes.
#pragma once

#include "projinfo/storage/storage.h"

#include <QString>

#include <memory>

namespace projinfo {

/// The property sets a new file gets, by format identifier.
inline constexpr char kSummaryInformation[] = "{F29F85E0-4FF9-1068-AB91-08002B27B3D9}";
inline constexpr char kDocSummaryInformation[] = "{D5CDD502-2E9C-101B-9397-08002B2CF9AE}";
inline constexpr char kUserDefinedProperties[] = "{D5CDD505-2E9C-101B-9397-08002B2CF9AE}";

/// The root of the file `FileName`, opened read-write and held exclusively. Creates the file (replacing
/// one that is there when `Overwrite`) and gives it its property sets when `IsNew` is passed true; opens
/// the file that is there otherwise, setting `IsNew` to false. A file that cannot be opened (held by
/// another program, damaged, unreadable) gives a Storage whose first operation raises why. A new file
/// that cannot be written yet (a read-only folder) is kept in memory: its storage works, and each commit
/// tries the write again.
std::shared_ptr<Storage> OpenOrCreateDocFile(const QString& FileName, bool& IsNew, bool AnsiFlag,
                                             bool Overwrite);

/// The root of an existing file, for reading only: no lock is taken, so a file that another program
/// holds can be read (as it was at its last commit). Raises what DocFile::open raises.
std::shared_ptr<Storage> OpenDocFileForReading(const QString& FileName);

/// Creates the summary, document-summary and user-defined property sets, empty but for their code page
/// (the ANSI one when `AnsiFlag`, else Unicode). True when nothing failed.
bool CreatePropertySets(const std::shared_ptr<Storage>& storage, bool AnsiFlag);

/// The platform's message for a storage failure code (or a system error number).
QString GetSystemErrorText(long number);

}  // namespace projinfo
