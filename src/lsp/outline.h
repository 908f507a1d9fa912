// SPDX-License-Identifier: MIT
// What a module's code holds for an editor, read line by line with the shared reading rules of
// src/syntax: its procedures, Type and Enum blocks and declarations (the outline and the workspace's
// symbols), the blocks that fold, and the blocks that do not balance, which would leave the indenter to
// guess where a level ends.
#pragma once

#include <QString>
#include <QStringView>

#include <vector>

namespace lsp {

/// The protocol's symbol kinds that the outline uses.
enum class SymbolKind : int {
  Method = 6,
  Property = 7,
  Field = 8,
  Enum = 10,
  Function = 12,
  Variable = 13,
  Constant = 14,
  EnumMember = 22,
  Struct = 23,
  Event = 24,
};

struct Symbol {
  QString name;
  SymbolKind kind = SymbolKind::Variable;
  /// "Public Sub", "Private Property Get", "Const" ...
  QString detail;
  int line = 0;  // the first and last line of the file it spans (0-based)
  int endLine = 0;
  int nameColumn = 0;  // where its name stands on its first line
  int nameLength = 0;
  std::vector<Symbol> children;
};

struct Fold {
  int startLine = 0;
  int endLine = 0;
};

/// A block that does not balance, at the line that shows it.
struct Imbalance {
  int line = 0;
  int column = 0;
  int length = 0;
  QString message;
};

struct Outline {
  std::vector<Symbol> symbols;
  std::vector<Fold> folds;
  std::vector<Imbalance> imbalances;
};

/// Reads the code of a module whose file lines are `lines`, the code starting at `firstCodeLine` (after
/// the header the code window never shows). Hidden attribute lines inside the code are passed over.
Outline readOutline(const std::vector<QStringView>& lines, int firstCodeLine);

}  // namespace lsp
