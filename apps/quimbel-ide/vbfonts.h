// SPDX-License-Identifier: MIT
// The fonts of forms and controls on a system without the classic Windows fonts. A font that is installed
// is used as it is; one that is not is replaced by a metric-compatible stand-in, so that captions take the
// room they take in the IDE:
//   MS Sans Serif, Microsoft Sans Serif -> MS Sans Serif from fonts-wine (Wine's metric-compatible remake)
//   Tahoma                              -> Tahoma from fonts-wine
//   Courier, Small Fonts, Fixedsys, System, Marlett, Symbol, Wingdings, Webdings -> fonts-wine's own
//   Arial -> Liberation Sans, Times New Roman -> Liberation Serif, Courier New -> Liberation Mono
//           (fonts-liberation; fontconfig also aliases these)
//   Calibri -> Carlito, Cambria -> Caladea (fonts-crosextra-*, when installed)
//   anything else (and a stand-in that is missing) -> DejaVu Sans
// fonts-wine installs its fonts outside fontconfig's folders; they are added to the application here.
#pragma once

#include "host/model/designer.h"

#include <QFont>
#include <QString>

namespace desktop {

/// The family a font name is drawn with: the name itself when installed, else its stand-in, else `fallback`.
QString fontFamilyFor(const QString& name, const QString& fallback = QStringLiteral("DejaVu Sans"));

/// The font of a control at the designer's 96 pixels per inch (15 twips per pixel).
QFont vbFont(const host::ControlFont& font);

/// The font of code windows: the IDE's Courier New 10, or its stand-in.
QFont codeFont();

}  // namespace desktop
