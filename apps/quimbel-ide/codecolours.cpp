// SPDX-License-Identifier: MIT
#include "codecolours.h"

#include <QSettings>

namespace desktop {
namespace {

constexpr const char* kNames[kCodeTextKinds] = {"Normal Text",  "Selection Text", "Syntax Error Text",
                                                "Comment Text", "Keyword Text",   "Identifier Text"};
constexpr const char* kKeys[kCodeTextKinds] = {"Normal",  "Selection", "SyntaxError",
                                               "Comment", "Keyword",   "Identifier"};

/// A colour as the settings keep it: "Auto" or "#rrggbb".
QString textOf(const QColor& colour) {
  return colour.isValid() ? colour.name() : QStringLiteral("Auto");
}
QColor colourOf(const QString& text, const QColor& fallback) {
  if (text.compare(QLatin1StringView("Auto"), Qt::CaseInsensitive) == 0) return {};
  const QColor colour = QColor::fromString(text);
  return colour.isValid() ? colour : fallback;
}

}  // namespace

CodeColours::CodeColours() {
  resetToDefaults();
}

CodeColours& CodeColours::instance() {
  static CodeColours colours;
  return colours;
}

QString CodeColours::name(CodeText kind) {
  return QString::fromLatin1(kNames[static_cast<int>(kind)]);
}

const std::array<QColor, 16>& CodeColours::palette() {
  static const std::array<QColor, 16> colours = {
      QColor(0x00, 0x00, 0x00), QColor(0x80, 0x00, 0x00), QColor(0x00, 0x80, 0x00), QColor(0x80, 0x80, 0x00),
      QColor(0x00, 0x00, 0x80), QColor(0x80, 0x00, 0x80), QColor(0x00, 0x80, 0x80), QColor(0xc0, 0xc0, 0xc0),
      QColor(0x80, 0x80, 0x80), QColor(0xff, 0x00, 0x00), QColor(0x00, 0xff, 0x00), QColor(0xff, 0xff, 0x00),
      QColor(0x00, 0x00, 0xff), QColor(0xff, 0x00, 0xff), QColor(0x00, 0xff, 0xff), QColor(0xff, 0xff, 0xff)};
  return colours;
}

CodeColour CodeColours::defaultColour(CodeText kind) {
  switch (kind) {
    case CodeText::SyntaxError:
      return {QColor(0xff, 0x00, 0x00), {}};
    case CodeText::Comment:
      return {QColor(0x00, 0x80, 0x00), {}};
    case CodeText::Keyword:
      return {QColor(0x00, 0x00, 0x80), {}};
    default:
      return {};
  }
}

QColor CodeColours::foreground(const Scheme& scheme, CodeText kind) {
  const QColor own = scheme[static_cast<int>(kind)].foreground;
  if (own.isValid()) return own;
  if (kind == CodeText::Selection) return QColor(Qt::white);
  // Automatic is the normal text's colour, and black for the normal text itself.
  return kind == CodeText::Normal ? QColor(Qt::black) : foreground(scheme, CodeText::Normal);
}

QColor CodeColours::background(const Scheme& scheme, CodeText kind) {
  const QColor own = scheme[static_cast<int>(kind)].background;
  if (own.isValid()) return own;
  if (kind == CodeText::Selection) return QColor(0x00, 0x00, 0x80);
  return kind == CodeText::Normal ? QColor(Qt::white) : background(scheme, CodeText::Normal);
}

void CodeColours::setColour(CodeText kind, const CodeColour& colour) {
  if (m_colours[static_cast<int>(kind)] == colour) return;
  m_colours[static_cast<int>(kind)] = colour;
  Q_EMIT changed();
}

void CodeColours::resetToDefaults() {
  for (int i = 0; i < kCodeTextKinds; ++i)
    m_colours[i] = defaultColour(static_cast<CodeText>(i));
  Q_EMIT changed();
}

void CodeColours::load(QSettings& settings) {
  settings.beginGroup(QStringLiteral("CodeColors"));
  for (int i = 0; i < kCodeTextKinds; ++i) {
    const CodeColour fallback = defaultColour(static_cast<CodeText>(i));
    const QString key = QString::fromLatin1(kKeys[i]);
    m_colours[i].foreground =
        colourOf(settings.value(key + QStringLiteral("Foreground"), textOf(fallback.foreground)).toString(),
                 fallback.foreground);
    m_colours[i].background =
        colourOf(settings.value(key + QStringLiteral("Background"), textOf(fallback.background)).toString(),
                 fallback.background);
  }
  settings.endGroup();
  Q_EMIT changed();
}

void CodeColours::save(QSettings& settings) const {
  settings.beginGroup(QStringLiteral("CodeColors"));
  for (int i = 0; i < kCodeTextKinds; ++i) {
    const QString key = QString::fromLatin1(kKeys[i]);
    settings.setValue(key + QStringLiteral("Foreground"), textOf(m_colours[i].foreground));
    settings.setValue(key + QStringLiteral("Background"), textOf(m_colours[i].background));
  }
  settings.endGroup();
}

}  // namespace desktop
