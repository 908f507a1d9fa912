// SPDX-License-Identifier: MIT
// Text insertion: what the keyboard macros, the copy buffers and the new-procedure wizard put into the
// code being edited. InsertText expands the placeholders ({ProjectName}, {ModuleName}, {ProcedureName},
// {ProcedureType}, {ControlName}, {ComputerName}, {UserName}, {Date}, {Time}; letter case does not matter),
// takes out the cursor markers {SS}, {SE} and {C}, replaces the active code pane's selection with the
// result and puts the caret or the selection where the markers stood.
#pragma once

#include "ide/vbide.h"

#include <QDateTime>
#include <QLocale>
#include <QString>

#include <functional>
#include <optional>

namespace textins {

/// The procedure that holds a line.
struct ProcInfo {
  /// Empty outside every procedure.
  QString Name;
  /// "Sub", "Function", "Property" or empty.
  QString Kind;
  /// The procedure's first line for the kind that was asked last.
  int StartLine = 0;
  /// The Sub or Function statement's line (Subs and Functions only).
  int BodyLine = 0;
  /// The line count of the property procedure looked at last.
  int CountLines = 0;
};

/// What the placeholders read besides the IDE, captured when the add-in starts.
struct InsertionContext {
  QString ComputerName;
  QString UserName;
  /// The type of the window that was active at the timer's last look: 0 a code window, 1 a designer, -1
  /// none. The cursor markers act only while it is 0.
  std::function<int()> LastWindowType;
  /// {Date} is its short date, {Time} its long time (without the time zone).
  QLocale locale = QLocale::system();
  std::function<QDateTime()> now = &QDateTime::currentDateTime;
};

/// The first character of `text` that the IDE's code page (Windows-1252) has no byte for, as a code point
/// (a pair of surrogates as one); nothing when every character fits. Code holding one cannot be saved.
std::optional<char32_t> firstNonAnsi(QStringView text);
/// What the user is told about such a character: it names the character and its code.
QString nonAnsiMessage(char32_t character);

/// The procedure of `component` that holds `line`. A Sub or Function statement gets its kind from the
/// keyword, also when the statement starts with it («Sub Main()»). Failures of the IDE are ignored: a field
/// the IDE could not give stays empty.
ProcInfo GetProcInfo(const ide::Ref<ide::VBComponent>& component, int line);

class TextInsertion {
 public:
  /// `vbe` must outlive the object.
  TextInsertion(ide::VBE& vbe, InsertionContext context);

  /// Puts `Text` at the selection of the active code pane, expanded for the selected component and the
  /// line where the selection starts. Never raises: a failure records the last error and shows "Erro na
  /// inserção de código."; the code and the selection stay as they were when the expansion fails, when
  /// the text holds a character the code page cannot (the message names it) and when the module refuses
  /// the text.
  void InsertText(const QString& Text);

  /// `Text` with its placeholders replaced for `Component` (may be empty) and the 1-based `Line` where it
  /// will land. A placeholder whose value is missing stays as written; an unknown "{...}" stays; the
  /// cursor markers stay only for the active code pane's component while a code window is active.
  /// Raises (with the error convention's location) when {ProjectName} cannot be reached.
  QString ExpandPlaceholders(const QString& Text, const ide::Ref<ide::VBComponent>& Component,
                             int Line) const;

  /// Replaces the selection of `CodeModule`'s code pane with `Text`. On an empty line with nothing
  /// selected the text goes in as new lines above it; a selection over several lines that ends at the
  /// start of an empty line keeps that line. Raises what the IDE raised; the lines of a selection are
  /// removed only once the text is in, so a refused text leaves the module as it was.
  void InsertCode(const ide::Ref<ide::CodeModule>& CodeModule, const QString& Text);

 private:
  bool markersStay(const ide::Ref<ide::VBComponent>& component) const;

  ide::VBE& m_vbe;
  InsertionContext m_context;
};

}  // namespace textins
