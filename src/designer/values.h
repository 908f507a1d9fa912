// SPDX-License-Identifier: MIT
// Values typed into the designer dialogs, read as VB reads text: numbers (decimal, "&H" hexadecimal, "&O"
// octal), the colour literals of the focus colour, the conversion of a typed text to the type a property
// already has, and VB's comparison of a Boolean with a number.
#pragma once

#include <QColor>
#include <QString>
#include <QStringView>
#include <QVariant>

#include <optional>

namespace designer {

/// Error numbers of VB's conversions.
inline constexpr long kOverflow = 6;
inline constexpr long kTypeMismatch = 13;

/// The value of a number as VB's IsNumeric takes it, blanks around it ignored: a decimal with an optional
/// sign, point and exponent ("-1.5E3"), or "&H" with up to 8 hexadecimal digits, or "&O" with octal
/// digits (4 hexadecimal digits or fewer are an Integer, so "&HFFFF" is -1). Nothing for anything else.
std::optional<double> vbNumber(QStringView text);

inline bool IsNumeric(QStringView text) {
  return vbNumber(text).has_value();
}

/// The check of a focus colour typed into a dialog: trimmed, and one trailing "&" ignored, the text is
/// empty or numeric.
bool isColourText(QStringView text);

/// A colour as a VB colour literal: "&H" + the value (red + green * 256 + blue * 65536) in upper-case
/// hexadecimal without leading zeros + "&".
QString colourLiteral(const QColor& colour);

/// The colour a literal names (decimal or "&H", one trailing "&" allowed); invalid when it names none.
QColor colourOf(QStringView literal);

/// `text` converted to the type of `sample`: 16- and 32-bit integers and bytes are rounded (halves to
/// even), Booleans take "True", "False" or a number, singles and doubles a number, strings the text;
/// any other type gives the text unchanged. Raises ide::Error 13 (type mismatch) for a text that is no
/// value of that type and 6 (overflow) for a number out of its range.
QVariant ToValueType(const QString& text, const QVariant& sample);

/// A value as VB's CStr shows it: Booleans as "True" and "False", empty as an empty text.
QString valueText(const QVariant& value);

/// VB's `=` on two values: a Boolean counts as -1 or 0, numbers compare by value, anything else as text.
bool sameValue(const QVariant& a, const QVariant& b);

}  // namespace designer
