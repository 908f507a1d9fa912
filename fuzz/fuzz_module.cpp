// SPDX-License-Identifier: MIT
// A module file through the file layer, the code index and the four walks of the command-line tool.
// Invariants: the file is written back byte for byte; the procedure extents cover the module after its
// declarations with no gap and no overlap, and an index kept up to date by the walks' edits agrees with
// one read afresh; numbering twice = numbering once; unnumber(number(x)) = x for code without numbers;
// indenting and number-and-indent are idempotent; no walk adds or removes lines.
#include "fuzzcommon.h"

#include "host/code/codetext.h"
#include "host/files/modulefile.h"
#include "host/model/vbe.h"
#include "ide/error.h"
#include "syntax/line.h"
#include "syntax/text.h"
#include "transform/indentwalk.h"
#include "transform/numberwalk.h"
#include "transform/numindent.h"

#include <QStringList>

namespace {

using host::CodeText;

void checkExtents(CodeText& text) {
  int next = text.countOfDeclarationLines() + 1;
  const std::vector<ide::ProcExtent> extents = text.procedureExtents();
  for (const ide::ProcExtent& extent : extents) {
    fuzz::check(extent.startLine == next, "a procedure starts right after the one above it");
    fuzz::check(extent.countLines > 0, "a procedure has lines");
    fuzz::check(extent.startLine <= extent.bodyLine && extent.bodyLine <= extent.headerEnd &&
                    extent.headerEnd < extent.startLine + extent.countLines,
                "a procedure's header lies inside its extent");
    next = extent.startLine + extent.countLines;
  }
  if (!extents.empty()) fuzz::check(next == text.countOfLines() + 1, "the last procedure ends the module");
}

bool sameExtents(const std::vector<ide::ProcExtent>& a, const std::vector<ide::ProcExtent>& b) {
  if (a.size() != b.size()) return false;
  for (std::size_t i = 0; i < a.size(); ++i) {
    if (a[i].name != b[i].name || a[i].kind != b[i].kind || a[i].startLine != b[i].startLine ||
        a[i].bodyLine != b[i].bodyLine || a[i].headerEnd != b[i].headerEnd ||
        a[i].countLines != b[i].countLines)
      return false;
  }
  return true;
}

struct Model {
  std::shared_ptr<host::VbeImpl> vbe = host::VbeImpl::create();
  std::shared_ptr<host::ProjectImpl> project = vbe->newProject();
  ide::Ref<ide::CodeModule> module = project->Add(ide::ComponentType::StdModule)->CodeModule();
  CodeText& text = std::dynamic_pointer_cast<host::CodeModuleImpl>(module)->text();
};

QStringList linesOf(CodeText& text) {
  QStringList lines;
  for (int i = 1; i <= text.countOfLines(); ++i)
    lines << text.line(i);
  return lines;
}

bool hasNumbers(const QStringList& lines) {
  for (const QString& line : lines)
    if (syntax::numberPrefix(syntax::trimmedView(line))) return true;
  return false;
}

enum class Walk { Number, Unnumber, Indent, NumIndent };

/// Runs `walk` over the module; false when it reported a failure (a line grown too long ...).
bool run(Model& model, Walk walk) {
  walk::WalkContext context(QStringLiteral("fuzz"), nullptr, nullptr);
  bool failed = false;
  context.onFailure = [&](const walk::WalkFailure&) { failed = true; };
  context.onLineSkipped = [&](const walk::WalkFailure&) { failed = true; };
  switch (walk) {
    case Walk::Number:
    case Walk::Unnumber:
      transform::NumberingWalk(context, 10000, 5).NumberModule(model.module, walk == Walk::Number);
      break;
    case Walk::Indent:
      transform::IndentationWalk(context, transform::IndentMode::Tabs, 3).IndentModule(model.module);
      break;
    case Walk::NumIndent:
      transform::NumIndentWalk(context, 10000, 5, transform::IndentMode::Spaces, 3, true)
          .NumIndentModule(model.module);
      break;
  }
  return !failed;
}

/// The index the walks' edits kept up to date agrees with one built from the lines as they are now.
void checkIndexAfterEdits(CodeText& edited) {
  std::vector<host::SourceLine> lines;
  for (int i = 1; i <= edited.countOfLines(); ++i)
    lines.push_back({edited.line(i), host::LineEnd::CRLF});
  CodeText fresh;
  fresh.load(std::move(lines), {});
  fuzz::check(sameExtents(edited.procedureExtents(), fresh.procedureExtents()),
              "the index kept through edits agrees with a fresh one");
  checkExtents(edited);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  if (size > 32 * 1024) return 0;  // the walks are linear; long inputs only slow the search down
  fuzz::ensureApplication();
  const QByteArray bytes = fuzz::bytesOf(data, size);
  host::ModuleSource source;
  try {
    source = host::parseModule(bytes, QStringLiteral("Fuzz.bas"));
  } catch (const ide::Error&) {
    return 0;  // refused with a message: not text, a line too long, a broken header
  }

  static Model model;
  model.text.load(source.code, source.memberAttributes);
  checkExtents(model.text);
  {
    host::ModuleSource back = source;
    model.text.store(back.code, back.memberAttributes);
    fuzz::check(host::writeModule(back, QStringLiteral("Fuzz.bas")) == bytes,
                "a module is written back as read");
  }
  const QStringList original = linesOf(model.text);

  if (!run(model, Walk::Number)) return 0;
  const QStringList numbered = linesOf(model.text);
  fuzz::check(numbered.size() == original.size(), "numbering keeps the lines");
  checkIndexAfterEdits(model.text);
  if (!run(model, Walk::Number)) return 0;
  fuzz::check(linesOf(model.text) == numbered, "numbering twice changes nothing the second time");
  if (!run(model, Walk::Unnumber)) return 0;
  if (!hasNumbers(original)) fuzz::check(linesOf(model.text) == original, "unnumber gives back the code");

  model.text.load(source.code, source.memberAttributes);
  if (!run(model, Walk::Indent)) return 0;
  const QStringList indented = linesOf(model.text);
  fuzz::check(indented.size() == original.size(), "indenting keeps the lines");
  checkIndexAfterEdits(model.text);
  if (!run(model, Walk::Indent)) return 0;
  fuzz::check(linesOf(model.text) == indented, "indenting twice changes nothing the second time");

  model.text.load(source.code, source.memberAttributes);
  if (!run(model, Walk::NumIndent)) return 0;
  const QStringList both = linesOf(model.text);
  fuzz::check(both.size() == original.size(), "number-and-indent keeps the lines");
  checkIndexAfterEdits(model.text);
  if (!run(model, Walk::NumIndent)) return 0;
  fuzz::check(linesOf(model.text) == both, "number-and-indent twice changes nothing the second time");
  return 0;
}
