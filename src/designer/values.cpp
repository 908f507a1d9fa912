// SPDX-License-Identifier: MIT
#include "designer/values.h"

#include "ide/error.h"

#include <QRegularExpression>

#include <cmath>
#include <limits>

namespace designer {
namespace {

QStringView trimmedBlanks(QStringView text) {
  while (!text.isEmpty() && (text.front() == u' ' || text.front() == u'\t'))
    text = text.sliced(1);
  while (!text.isEmpty() && (text.back() == u' ' || text.back() == u'\t'))
    text.chop(1);
  return text;
}

/// "&H" and "&O" literals: up to 16 bits they are an Integer (sign-extended), up to 32 bits a Long.
std::optional<double> radixNumber(QStringView digits, int base) {
  const int maxDigits = base == 16 ? 8 : 11;
  if (digits.isEmpty() || digits.size() > maxDigits) return std::nullopt;
  bool ok = false;
  const qulonglong value = digits.toULongLong(&ok, base);
  if (!ok || value > 0xFFFFFFFFull) return std::nullopt;
  const bool integer = base == 16 ? digits.size() <= 4 : value <= 0xFFFFull;
  if (integer) return static_cast<qint16>(static_cast<quint16>(value));
  return static_cast<qint32>(static_cast<quint32>(value));
}

[[noreturn]] void typeMismatch() {
  ide::raise(kTypeMismatch, QStringLiteral("Type mismatch"));
}

[[noreturn]] void overflow() {
  ide::raise(kOverflow, QStringLiteral("Overflow"));
}

double numberOrMismatch(const QString& text) {
  const std::optional<double> number = vbNumber(text);
  if (!number) typeMismatch();
  return *number;
}

/// VB's CInt, CLng and CByte: the number rounded with halves to even, within its range.
qint64 wholeNumber(const QString& text, qint64 minimum, qint64 maximum) {
  const double rounded = std::nearbyint(numberOrMismatch(text));
  if (rounded < double(minimum) || rounded > double(maximum)) overflow();
  return static_cast<qint64>(rounded);
}

std::optional<double> numberOfValue(const QVariant& value) {
  switch (value.typeId()) {
    case QMetaType::Bool:
      return value.toBool() ? -1.0 : 0.0;
    case QMetaType::Short:
    case QMetaType::UShort:
    case QMetaType::Int:
    case QMetaType::UInt:
    case QMetaType::LongLong:
    case QMetaType::ULongLong:
    case QMetaType::UChar:
    case QMetaType::SChar:
    case QMetaType::Float:
    case QMetaType::Double:
      return value.toDouble();
    default:
      return std::nullopt;
  }
}

}  // namespace

std::optional<double> vbNumber(QStringView text) {
  const QStringView t = trimmedBlanks(text);
  if (t.size() >= 2 && t.front() == u'&') {
    const QChar radix = t[1].toUpper();
    if (radix == u'H') return radixNumber(t.sliced(2), 16);
    if (radix == u'O') return radixNumber(t.sliced(2), 8);
    return std::nullopt;
  }
  static const QRegularExpression decimal(QStringLiteral(R"(^[+-]?(\d+\.?\d*|\.\d+)([EeDd][+-]?\d+)?$)"));
  if (!decimal.match(t).hasMatch()) return std::nullopt;
  QString normalised = t.toString();
  normalised.replace(u'D', u'E').replace(u'd', u'E');
  bool ok = false;
  const double value = normalised.toDouble(&ok);
  if (!ok || !std::isfinite(value)) return std::nullopt;
  return value;
}

bool isColourText(QStringView text) {
  QStringView t = trimmedBlanks(text);
  if (t.endsWith(u'&')) t.chop(1);
  return t.isEmpty() || IsNumeric(t);
}

QString colourLiteral(const QColor& colour) {
  const quint32 value = quint32(colour.red()) | quint32(colour.green()) << 8 | quint32(colour.blue()) << 16;
  return QStringLiteral("&H%1&").arg(QString::number(value, 16).toUpper());
}

QColor colourOf(QStringView literal) {
  QStringView t = trimmedBlanks(literal);
  if (t.endsWith(u'&')) t.chop(1);
  qulonglong value = 0;
  bool ok = false;
  if (t.startsWith(u"&H", Qt::CaseInsensitive))
    value = t.sliced(2).toULongLong(&ok, 16);
  else
    value = t.toULongLong(&ok, 10);
  if (!ok || value > 0xFFFFFF) return {};  // the system colours (&H80000005& ...) are no RGB value
  return QColor(int(value & 0xFF), int(value >> 8 & 0xFF), int(value >> 16 & 0xFF));
}

QVariant ToValueType(const QString& text, const QVariant& sample) {
  switch (sample.typeId()) {
    case QMetaType::Short:
      return QVariant::fromValue(static_cast<qint16>(wholeNumber(text, -32768, 32767)));
    case QMetaType::Int:
      return QVariant::fromValue(static_cast<qint32>(
          wholeNumber(text, std::numeric_limits<qint32>::min(), std::numeric_limits<qint32>::max())));
    case QMetaType::UChar:
      return QVariant::fromValue(static_cast<uchar>(wholeNumber(text, 0, 255)));
    case QMetaType::Float: {
      const double number = numberOrMismatch(text);
      if (std::abs(number) > double(std::numeric_limits<float>::max())) overflow();
      return QVariant::fromValue(static_cast<float>(number));
    }
    case QMetaType::Double:
      return QVariant::fromValue(numberOrMismatch(text));
    case QMetaType::Bool: {
      const QStringView t = trimmedBlanks(text);
      if (t.compare(u"True", Qt::CaseInsensitive) == 0) return true;
      if (t.compare(u"False", Qt::CaseInsensitive) == 0) return false;
      return numberOrMismatch(text) != 0.0;
    }
    default:
      return text;
  }
}

QString valueText(const QVariant& value) {
  if (!value.isValid()) return {};
  if (value.typeId() == QMetaType::Bool)
    return value.toBool() ? QStringLiteral("True") : QStringLiteral("False");
  return value.toString();
}

bool sameValue(const QVariant& a, const QVariant& b) {
  const std::optional<double> x = numberOfValue(a);
  const std::optional<double> y = numberOfValue(b);
  if (x && y) return *x == *y;
  if (a.isValid() != b.isValid()) return false;
  return valueText(a) == valueText(b);
}

}  // namespace designer
