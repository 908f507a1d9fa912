// SPDX-License-Identifier: MIT
// What the add-in does on its own while forms are designed: new forms are centred and get a fixed border,
// new labels turn transparent, new text boxes lose their text and get event procedures (select the text
// and colour the box on focus, capitals, Enter as Tab), and a renamed control's name is carried into its
// form's code. The option globals switch each action; no widgets here: the property defaults dialog is
// reached through a function the add-in gives.
#pragma once

#include "common/options.h"
#include "ide/vbide.h"

#include <QString>
#include <QStringView>

#include <functional>

namespace designer {

/// What the property defaults dialog hands back for a new control.
struct PropsChoice {
  bool Cancelled = true;
  bool EnterAsTab = false;
  bool BackColorOnFocus = false;
  QString FocusColor;
};

/// Shows the property defaults dialog modally for the control and returns the choices made.
using ShowProperties = std::function<PropsChoice(const ide::Ref<ide::VBControl>&)>;

/// `line` with every reference to the control `oldName` renamed to `newName`: the name as a whole
/// identifier, or as the start of one of the control's event procedures (`Text1_Change`), matched with
/// its case; never inside a longer name ("Text10") nor inside a string literal. Comments are renamed
/// too: they talk about the control.
QString renameControlInLine(QStringView line, QStringView oldName, QStringView newName);

class DesignerActions {
 public:
  DesignerActions(ide::UserInterface& ui, const common::Options& options, ShowProperties showProperties)
      : m_ui(ui), m_options(options), m_showProperties(std::move(showProperties)) {}

  /// A component was added: a new form (never saved, no MDI child) is centred and gets a fixed border,
  /// as the options say.
  void FormAdded(const ide::Ref<ide::VBComponent>& component);
  /// A control was added to the designer the add-in follows.
  void ControlAdded(const ide::Ref<ide::VBControl>& control);
  /// A control was renamed (or re-indexed): with the option on, the old name in its form's code becomes
  /// the new one. The lines are all rewritten or, when the module refuses a line, none is.
  void ControlRenamed(const ide::Ref<ide::VBControl>& control, const QString& oldName, int oldIndex);

  // The code writers: each appends its procedures to the module of the control's form, unless the
  // module has them already.
  /// Name_KeyDown turning Enter into Tab (not for labels, frames, pictures, images, buttons and timers).
  void IncluirCodigoDeTabParaKeyReturn(ide::VBControl& ctl);
  /// Name_GotFocus colouring the box and selecting its text, and Name_LostFocus giving it back the
  /// colour the form gave it. The colour only on a control with a BackColor and focus events.
  void IncluirCodigoGotLostFocus(ide::VBControl& ctl, bool applyColour, const QString& colour);
  /// Name_KeyPress turning typed letters into capitals.
  void IncluirCodigoTextUcase(ide::VBControl& ctl);

 private:
  bool selectsText(const QString& className) const;

  ide::UserInterface& m_ui;
  const common::Options& m_options;
  ShowProperties m_showProperties;
};

}  // namespace designer
