// SPDX-License-Identifier: MIT
// Numbering and indentation of one module for an editor: the text the editor holds is read as the IDE
// reads the module's file, walked by the same walks as the command-line tool, and what changed comes back
// as edits of the editor's text (only the lines that changed, only the part of each that changed).
#pragma once

#include "codestyle/codestyle.h"
#include "lsp/documents.h"
#include "lsp/protocol.h"

#include <QString>

#include <memory>
#include <variant>
#include <vector>

namespace lsp {

enum class Rewrite { Indent, Number, Unnumber, NumIndent };

struct TextEdit {
  Range range;
  QString newText;
};

struct RewriteJob {
  /// The module's file: its kind of module, and the name messages give it.
  QString path;
  /// The module as the editor holds it.
  QString text;
  Rewrite what = Rewrite::Indent;
  codestyle::Style style;
  /// Only this procedure (every Get, Let and Set of a property); empty: the whole module.
  QString procedure;
};

/// Rewrites modules for an editor. The IDE model of the last module rewritten is kept until release(), so
/// that taking a large module apart comes after the answer, not before it.
class ModuleRewriter {
 public:
  ModuleRewriter();
  ~ModuleRewriter();
  ModuleRewriter(const ModuleRewriter&) = delete;
  ModuleRewriter& operator=(const ModuleRewriter&) = delete;

  /// The edits that turn `job.text` into what the command-line tool writes: `quimbel indent` for Indent
  /// (never numbering, whatever the style joins to it: a format touches only leading blanks), `number`,
  /// `unnumber` (both re-indenting where the style joins the two) and `numindent`.
  std::variant<std::vector<TextEdit>, Failure> rewrite(const RewriteJob& job);
  /// Lets the last module's model go.
  void release();

 private:
  struct Model;
  std::unique_ptr<Model> m_last;
};

}  // namespace lsp
