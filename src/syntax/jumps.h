// SPDX-License-Identifier: MIT
// The numeric labels that the statements of one procedure jump to.
#pragma once

#include <QSet>
#include <QString>
#include <QStringView>

#include <span>

namespace syntax {

/// The numeric labels that the statements of one procedure jump to: the labels after GoTo, GoSub and
/// Resume, the lists of On ... GoTo and On ... GoSub, and a number right after Then or Else (a one-line If
/// jumps there). Jumps inside string literals and comments do not count, and On Error GoTo 0 and Resume 0
/// name no label. "010" and "10" name the same label, as the language compares their values.
class JumpTargets {
 public:
  /// No jumps.
  JumpTargets() = default;
  /// The jumps of a procedure's lines, continued statements included.
  explicit JumpTargets(std::span<const QString> lines);

  /// True when `line` begins (after its leading blanks) with a numeric label that a jump names.
  bool isTarget(QStringView line) const;
  bool empty() const { return m_labels.isEmpty(); }
  /// True when a jump names the line number `number`.
  bool names(qint32 number) const {
    return !m_labels.isEmpty() && m_labels.contains(QString::number(number));
  }

 private:
  QSet<QString> m_labels;  // the label's digits without leading zeros
};

}  // namespace syntax
