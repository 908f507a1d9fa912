// SPDX-License-Identifier: MIT
// How the new-procedure wizard writes into the module of the active code pane: the names it must not
// reuse, the member variable, the procedures appended at the end with their templates, and the default
// member. No widgets.
#pragma once

#include "ide/vbide.h"
#include "newproc/procgen.h"

#include <optional>

namespace textins {
class TextInsertion;
}

namespace newproc {

/// The two templates as the wizard inserts them (lines joined by CR LF).
struct Templates {
  QString errorHandler;
  QString docHeader;
};

/// Refuses a name the module already uses where the new code would not compile: the procedure's name
/// taken by another member (for a property: by anything but the same property, or by one of the
/// accessors to write), 5117; the member variable's name taken by any member, 5118. The controls of the
/// module's form, its Enums, their members and its Types count as names in use too.
std::optional<Refusal> CheckNamesFree(ide::CodeModule& module, const NewProcChoices& choices);

/// The line of the `End` statement of the procedure written at `startLine`: the procedure's last line as
/// the IDE counts it, then up past the lines of two characters or fewer. Raises the add-in's cancel code
/// (9999) should it find none.
int EndLineOf(ide::CodeModule& module, int startLine, const QString& name, ide::ProcKind kind);

/// Makes `name` the default member of the module: a member that was the default gets an identifier no
/// other member uses.
void MakeDefaultMember(ide::CodeModule& module, const QString& name);

/// Writes what `choices` ask for into the module of `pane`: a property's member variable after the
/// declarations, then each procedure at the end of the module with the ticked templates inserted through
/// `insertion`, the default member, and the pane scrolled to the last procedure. Returns the line where
/// the last procedure was written. Raises what the IDE raised; what was written until then stays.
int WriteProcedures(ide::VBE& vbe, const ide::Ref<ide::CodePane>& pane, const NewProcChoices& choices,
                    const Templates& templates, textins::TextInsertion& insertion);

}  // namespace newproc
