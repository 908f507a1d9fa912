// SPDX-License-Identifier: MIT
// A module file (.bas, .cls, .frm, .ctl, .pag, .dob, .dsr) split into the parts the IDE treats apart: the
// header the code window never shows (VERSION, Object=, a class's BEGIN block, the form description, the
// module's "Attribute VB_" lines), the code, and the member attributes hidden inside the code. Writing the
// parts back gives the file's bytes unchanged when nothing was edited.
#pragma once

#include "host/files/formdescription.h"
#include "host/files/sourcelines.h"
#include "host/files/vbliteral.h"

#include <QByteArray>
#include <QByteArrayView>
#include <QString>
#include <QStringView>

#include <optional>
#include <vector>

namespace host {

/// A hidden "Attribute X.VB_... = ..." line inside the code, placed after code line afterCodeLine (1-based;
/// 0 is before the first code line). Examples: "Attribute Item.VB_UserMemId = 0" after a procedure
/// header, "Attribute x.VB_VarHelpID = -1" after a variable.
struct MemberAttributeLine {
  int afterCodeLine = 0;
  SourceLine line;
};

struct ModuleSource {
  std::vector<SourceLine> preamble;          // VERSION line, Object= lines, a class's BEGIN..END block: raw
  std::optional<FormDescription> form;       // the Begin ... End form description of .frm/.ctl/.pag/.dob/.dsr
  std::vector<SourceLine> moduleAttributes;  // the header's "Attribute VB_..." lines: raw
  std::vector<SourceLine> code;              // what the code window shows
  std::vector<MemberAttributeLine> memberAttributes;  // in file order, so afterCodeLine never decreases
};

/// Splits a module file. Throws ide::Error 321 naming `fileName` and the line for what readSourceLines
/// refuses, a BEGIN without END, and a malformed form description.
ModuleSource parseModule(QByteArrayView bytes, const QString& fileName);

/// A module file read up to its code: the header parts (no code yet), and where the code starts.
struct ModuleHead {
  ModuleSource source;
  qsizetype codeOffset = 0;  // the byte where the code starts
  int codeLine = 0;          // the 0-based line where the code starts
};

/// The head of parseModule, reading no line of the code but the first.
ModuleHead parseModuleHead(QByteArrayView bytes, const QString& fileName);

/// The code part of parseModule: `code` is the file from its line `firstLine` (0-based) on; appends the
/// code and member attribute lines to `into`.
void parseModuleCode(QByteArrayView code, const QString& fileName, int firstLine, ModuleSource& into);

/// The same from lines already read.
ModuleSource parseModuleLines(const std::vector<SourceLine>& lines, const QString& fileName);

/// The file's bytes: byte-identical to the input of parseModule when nothing changed. Member attributes
/// are written after their code line. Throws as writeSourceLines.
QByteArray writeModule(const ModuleSource& source, const QString& fileName);

/// The value of `Attribute VB_Name = "..."` without its quotes, or an empty text.
QString moduleName(const ModuleSource& source);

/// Rewrites the VB_Name line (adding it when missing) and the name on the form description's Begin line.
void setModuleName(ModuleSource& source, const QString& name);

/// The raw value of the header line "Attribute <name> = <value>" (`"Class1"`, `True`), or nothing.
std::optional<QString> moduleAttribute(const ModuleSource& source, QStringView name);

/// Rewrites the header line "Attribute <name> = <rawValue>", or adds it after the last one.
void setModuleAttribute(ModuleSource& source, const QString& name, const QString& rawValue);

}  // namespace host
