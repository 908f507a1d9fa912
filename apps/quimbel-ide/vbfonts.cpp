// SPDX-License-Identifier: MIT
#include "vbfonts.h"

#include <QDir>
#include <QFontDatabase>
#include <QFontMetrics>
#include <QHash>
#include <QPainter>

#include <cmath>

namespace desktop {
namespace {

/// Folders of fonts that fontconfig does not scan.
constexpr const char* kExtraFontFolders[] = {"/usr/share/wine/fonts"};

struct Substitute {
  const char* name;
  std::initializer_list<const char*> standIns;
  bool compatible;  // the first stand-in found has the font's metrics
};

const Substitute kSubstitutes[] = {
    {"Arial", {"Liberation Sans", "Arimo"}, true},
    {"Times New Roman", {"Liberation Serif", "Tinos"}, true},
    {"Courier New", {"Liberation Mono", "Cousine"}, true},
    {"Calibri", {"Carlito"}, true},
    {"Cambria", {"Caladea"}, true},
    {"Tahoma", {"Tahoma"}, true},
    {"MS Sans Serif", {"Tahoma", "Liberation Sans"}, false},
    {"Microsoft Sans Serif", {"Tahoma", "Liberation Sans"}, false},
    {"Segoe UI", {"Tahoma", "Liberation Sans"}, false},
    {"Verdana", {"DejaVu Sans"}, false},
    {"Small Fonts", {"DejaVu Sans"}, false},
    {"MS Serif", {"Liberation Serif"}, false},
    {"Courier", {"Liberation Mono"}, false},
    {"Fixedsys", {"Liberation Mono", "DejaVu Sans Mono"}, false},
    {"System", {"Liberation Mono", "DejaVu Sans Mono"}, false},
};

/// The installed scalable families by their lower-case names, with the extra folders added once.
const QHash<QString, QString>& installedFamilies() {
  static const QHash<QString, QString> families = [] {
    for (const char* folder : kExtraFontFolders) {
      const QDir dir(QString::fromLatin1(folder));
      for (const QString& file : dir.entryList({QStringLiteral("*.ttf")}, QDir::Files))
        QFontDatabase::addApplicationFont(dir.filePath(file));
    }
    QHash<QString, QString> byName;
    for (const QString& family : QFontDatabase::families())
      if (QFontDatabase::isSmoothlyScalable(family)) byName.insert(family.toLower(), family);
    return byName;
  }();
  return families;
}

const Substitute* substituteOf(const QString& name) {
  for (const Substitute& substitute : kSubstitutes)
    if (name.compare(QLatin1StringView(substitute.name), Qt::CaseInsensitive) == 0) return &substitute;
  return nullptr;
}

}  // namespace

QString fontFamilyFor(const QString& name, const QString& fallback) {
  const auto& families = installedFamilies();
  if (const auto found = families.find(name.toLower()); found != families.end()) return *found;
  if (const Substitute* substitute = substituteOf(name))
    for (const char* standIn : substitute->standIns)
      if (const auto found = families.find(QString::fromLatin1(standIn).toLower()); found != families.end())
        return *found;
  return fallback;
}

bool hasCompatibleMetrics(const QString& name) {
  const auto& families = installedFamilies();
  if (families.contains(name.toLower())) return true;
  const Substitute* substitute = substituteOf(name);
  if (!substitute || !substitute->compatible) return false;
  const QString first = QString::fromLatin1(*substitute->standIns.begin()).toLower();
  return families.contains(first);
}

QFont vbFont(const host::ControlFont& font) {
  QFont result(fontFamilyFor(font.name));
  // Points at 96 pixels per inch; 8.25 points is the IDE's 11 pixels.
  result.setPixelSize(std::max(1, static_cast<int>(std::lround(font.size * 96.0 / 72.0))));
  result.setBold(font.bold);
  result.setItalic(font.italic);
  result.setUnderline(font.underline);
  result.setStrikeOut(font.strikethrough);
  return result;
}

qreal fitText(const QPainter& painter, const QRect& area, int flags, const QString& text, bool compatible) {
  if (compatible || text.isEmpty() || area.width() <= 0) return 1.0;
  const QFontMetricsF metrics(painter.font());
  const bool wrapped = flags & Qt::TextWordWrap;
  // The lines the area holds (at least one): a wrapped caption may use them all. A face whose leading is
  // negative has lines closer than their height.
  const qreal line = std::max(metrics.lineSpacing(), metrics.height());
  const int lines = std::max(1, static_cast<int>(area.height() / line));
  const auto fits = [&](qreal scale) {
    const QRectF room(0, 0, area.width() / scale, 1e6);
    const QRectF needed = metrics.boundingRect(room, flags & ~Qt::AlignVertical_Mask, text);
    if (!wrapped) return needed.width() <= room.width();
    return needed.height() <= lines * line + 0.5 && needed.width() <= room.width();
  };
  if (fits(1.0)) return 1.0;
  constexpr qreal kNarrowest = 0.5;
  if (!fits(kNarrowest)) return 1.0;
  // The widest scale that fits, to a hundredth.
  qreal low = kNarrowest, high = 1.0;
  while (high - low > 0.01) {
    const qreal middle = (low + high) / 2;
    (fits(middle) ? low : high) = middle;
  }
  return low;
}

QFont codeFont() {
  QFont font = QFontDatabase::systemFont(QFontDatabase::FixedFont);
  font.setFamily(fontFamilyFor(QStringLiteral("Courier New"), QStringLiteral("DejaVu Sans Mono")));
  font.setStyleHint(QFont::Monospace);
  font.setPointSize(10);
  return font;
}

}  // namespace desktop
