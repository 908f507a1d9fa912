// SPDX-License-Identifier: MIT
#include "vbfonts.h"

#include <QDir>
#include <QFontDatabase>
#include <QHash>

#include <cmath>

namespace desktop {
namespace {

/// Folders of fonts that fontconfig does not scan.
constexpr const char* kExtraFontFolders[] = {"/usr/share/wine/fonts"};

struct Substitute {
  const char* name;
  std::initializer_list<const char*> standIns;
};

const Substitute kSubstitutes[] = {
    {"MS Sans Serif", {"MS Sans Serif", "Liberation Sans"}},
    {"Microsoft Sans Serif", {"MS Sans Serif", "Liberation Sans"}},
    {"Tahoma", {"Tahoma"}},
    {"Arial", {"Liberation Sans", "Arimo"}},
    {"Times New Roman", {"Liberation Serif", "Tinos"}},
    {"Courier New", {"Liberation Mono", "Cousine"}},
    {"Courier", {"Courier", "Liberation Mono"}},
    {"MS Serif", {"Liberation Serif"}},
    {"Calibri", {"Carlito"}},
    {"Cambria", {"Caladea"}},
    {"Verdana", {"DejaVu Sans"}},
};

/// The installed families by their lower-case names, with the extra folders added once.
const QHash<QString, QString>& installedFamilies() {
  static const QHash<QString, QString> families = [] {
    for (const char* folder : kExtraFontFolders) {
      const QDir dir(QString::fromLatin1(folder));
      for (const QString& file : dir.entryList({QStringLiteral("*.ttf")}, QDir::Files))
        QFontDatabase::addApplicationFont(dir.filePath(file));
    }
    QHash<QString, QString> byName;
    for (const QString& family : QFontDatabase::families())
      byName.insert(family.toLower(), family);
    return byName;
  }();
  return families;
}

}  // namespace

QString fontFamilyFor(const QString& name, const QString& fallback) {
  const auto& families = installedFamilies();
  for (const Substitute& substitute : kSubstitutes) {
    if (name.compare(QLatin1StringView(substitute.name), Qt::CaseInsensitive) != 0) continue;
    for (const char* standIn : substitute.standIns)
      if (const auto found = families.find(QString::fromLatin1(standIn).toLower()); found != families.end())
        return *found;
  }
  if (const auto found = families.find(name.toLower()); found != families.end()) return *found;
  return fallback;
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

QFont codeFont() {
  QFont font = QFontDatabase::systemFont(QFontDatabase::FixedFont);
  font.setFamily(fontFamilyFor(QStringLiteral("Courier New"), QStringLiteral("DejaVu Sans Mono")));
  font.setStyleHint(QFont::Monospace);
  font.setPointSize(10);
  return font;
}

}  // namespace desktop
