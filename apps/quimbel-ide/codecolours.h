// SPDX-License-Identifier: MIT
// The colours of code windows, as the IDE's Editor Format options keep them: for each kind of text a
// foreground and a background, each "Automatic" or one of the sixteen colours of the palette. The defaults
// are the IDE's: keywords dark blue, comments green, syntax errors red, everything else black on white;
// strings have no colour of their own. The scheme is one for the whole program and remembered in the desktop
// IDE's settings (section "CodeColors").
#pragma once

#include <QColor>
#include <QObject>
#include <QString>

#include <array>

class QSettings;

namespace desktop {

enum class CodeText { Normal, Selection, SyntaxError, Comment, Keyword, Identifier };
inline constexpr int kCodeTextKinds = 6;

struct CodeColour {
  QColor foreground;  // invalid: Automatic
  QColor background;  // invalid: Automatic
  bool operator==(const CodeColour&) const = default;
};

class CodeColours final : public QObject {
  Q_OBJECT

 public:
  using Scheme = std::array<CodeColour, kCodeTextKinds>;

  /// The scheme every code window follows.
  static CodeColours& instance();

  /// The names the options list them by ("Normal Text", "Keyword Text" ...).
  static QString name(CodeText kind);
  /// The sixteen colours of the palette, in the IDE's order.
  static const std::array<QColor, 16>& palette();
  static CodeColour defaultColour(CodeText kind);

  CodeColour colour(CodeText kind) const { return m_colours[static_cast<int>(kind)]; }
  const Scheme& scheme() const { return m_colours; }
  /// What is drawn: Automatic resolved (black text on white, the selection white on dark blue, the other
  /// kinds as the normal text).
  static QColor foreground(const Scheme& scheme, CodeText kind);
  static QColor background(const Scheme& scheme, CodeText kind);
  QColor foreground(CodeText kind) const { return foreground(m_colours, kind); }
  QColor background(CodeText kind) const { return background(m_colours, kind); }
  void setColour(CodeText kind, const CodeColour& colour);
  void resetToDefaults();

  void load(QSettings& settings);
  void save(QSettings& settings) const;

 Q_SIGNALS:
  void changed();

 private:
  CodeColours();
  Scheme m_colours;
};

}  // namespace desktop
