// SPDX-License-Identifier: MIT
// The events of forms, classes, user controls and the intrinsic controls, with the parameters their event
// procedures take, and the event a new procedure of each is given by default (a button's Click, a form's
// Load). What the code window's Procedure box lists for an object, and what an event procedure's header is.
#pragma once

#include <QString>
#include <QStringView>

#include <span>

namespace host {

struct EventInfo {
  const char* name;        // "KeyPress"
  const char* parameters;  // "KeyAscii As Integer"; empty for none
};

/// The events of a class as written on a Begin line ("VB.TextBox", "TextBox", "VB.Form", "VB.UserControl"),
/// or of "Class" (a class module), in alphabetical order. A class the tables do not know (an ActiveX or user
/// control) has the events its container gives every control: DragDrop, DragOver, GotFocus, LostFocus,
/// Validate.
std::span<const EventInfo> controlEvents(QStringView className);

/// The event a new procedure of the class is for ("Click"; "Load" for a form, "Change" for a text box).
QString defaultEvent(QStringView className);

/// The header of an event procedure: "Private Sub cmdOk_Click()"; an element of a control array takes
/// "Index As Integer" before the event's own parameters.
QString eventProcedureHeader(QStringView objectName, const EventInfo& event, bool controlArray);

}  // namespace host
