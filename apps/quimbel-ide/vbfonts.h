// SPDX-License-Identifier: MIT
// The fonts of forms and controls on a system without the classic Windows fonts. Every font is drawn at
// its point size, so only scalable faces are used: a bitmap face (Wine's MS Sans Serif, Courier, System,
// Small Fonts) would be drawn at one size whatever the size asked. A font that is installed as a scalable
// face is used as it is; one that is not is replaced by a stand-in:
//   metric-compatible (the text takes the room it takes in the IDE):
//     Arial -> Liberation Sans, Times New Roman -> Liberation Serif, Courier New -> Liberation Mono
//     (fonts-liberation), Calibri -> Carlito, Cambria -> Caladea (fonts-crosextra-*, when installed),
//     Tahoma -> Wine's Tahoma (fonts-wine)
//   close in shape only (text that would not fit its control is narrowed to fit, see fitText):
//     MS Sans Serif, Microsoft Sans Serif, Segoe UI -> Tahoma; Verdana, Small Fonts -> DejaVu Sans;
//     Courier, Fixedsys, System -> Liberation Mono; MS Serif -> Liberation Serif;
//     anything else (and a stand-in that is missing) -> DejaVu Sans
// fonts-wine installs its fonts outside fontconfig's folders; its scalable ones are added here.
#pragma once

#include "host/model/designer.h"

#include <QFont>
#include <QString>

class QPainter;
class QRect;

namespace desktop {

/// The family a font name is drawn with: the name itself when installed as a scalable face, else its
/// stand-in, else `fallback`.
QString fontFamilyFor(const QString& name, const QString& fallback = QStringLiteral("DejaVu Sans"));

/// Whether text in `name` takes the room it takes in the IDE: the font is installed or its stand-in has
/// the same metrics.
bool hasCompatibleMetrics(const QString& name);

/// The font of a control at the designer's 96 pixels per inch (15 twips per pixel).
QFont vbFont(const host::ControlFont& font);

/// The horizontal scale (at most 1) that makes `text` in the painter's font fit `area` with `flags` as
/// laid out by QPainter::drawText: on one line when it is not wrapped, in the lines the area holds when it
/// is. 1 when the font has the IDE's metrics, or when the text fits or could never fit (a caption that
/// also overflows in the IDE stays as the IDE shows it). Never below a half.
qreal fitText(const QPainter& painter, const QRect& area, int flags, const QString& text, bool compatible);

/// The font of code windows: the IDE's Courier New 10, or its stand-in.
QFont codeFont();

}  // namespace desktop
