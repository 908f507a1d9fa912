// SPDX-License-Identifier: MIT
#include "lsp/rewrite.h"

#include "host/files/ansi.h"
#include "host/model/vbe.h"
#include "ide/error.h"
#include "transform/indentwalk.h"
#include "transform/numberwalk.h"
#include "transform/numindent.h"

#include <QFile>
#include <QFileInfo>
#include <QTemporaryDir>

#include <algorithm>

namespace lsp {

namespace {

Failure failure(const QString& message) {
  return Failure{kRequestFailed, message};
}

/// Runs the walk the job asks for on `module` (or on its member).
void walkModule(walk::WalkContext& context, const ide::Ref<ide::CodeModule>& module,
                const ide::Ref<ide::Member>& member, const RewriteJob& job) {
  const transform::NumberingOptions numbering = job.style.numbering();
  const transform::IndentationOptions indentation = job.style.indentation();
  const bool add = job.what != Rewrite::Unnumber;
  if (job.what == Rewrite::Indent) {
    transform::IndentationWalk walk(context, indentation.mode, indentation.spaces);
    member ? walk.IndentMember(module, member) : walk.IndentModule(module);
  } else if (job.what == Rewrite::NumIndent || job.style.numIndent.value) {
    transform::NumIndentWalk walk(context, numbering.startNumber, numbering.interval, indentation.mode,
                                  indentation.spaces, add);
    member ? walk.NumIndentMember(module, member) : walk.NumIndentModule(module);
  } else {
    transform::NumberingWalk walk(context, numbering.startNumber, numbering.interval);
    member ? walk.NumberMember(module, member, add) : walk.NumberModule(module, add);
  }
}

/// The edits from `before` to `after`, texts with the same lines: per changed line, the part that changed.
std::variant<std::vector<TextEdit>, Failure> lineEdits(QStringView before, QStringView after) {
  const LineIndex old(before);
  const LineIndex now(after);
  if (old.count() != now.count()) return failure(QStringLiteral("the walk changed the number of lines"));
  std::vector<TextEdit> edits;
  for (int i = 0; i < old.count(); ++i) {
    const QStringView a = old.line(before, i);
    const QStringView b = now.line(after, i);
    if (a == b) continue;
    qsizetype prefix = 0;
    while (prefix < a.size() && prefix < b.size() && a[prefix] == b[prefix])
      ++prefix;
    qsizetype suffix = 0;
    while (suffix < a.size() - prefix && suffix < b.size() - prefix &&
           a[a.size() - 1 - suffix] == b[b.size() - 1 - suffix])
      ++suffix;
    edits.push_back({{{i, int(prefix)}, {i, int(a.size() - suffix)}},
                     b.mid(prefix, b.size() - prefix - suffix).toString()});
  }
  return edits;
}

}  // namespace

std::variant<std::vector<TextEdit>, Failure> rewriteModule(const RewriteJob& job) {
  const QString fileName = QFileInfo(job.path).fileName();
  qsizetype bad = -1;
  const auto bytes = host::encodeAnsi(job.text, &bad);
  if (!bytes) {
    const int line = int(QStringView(job.text).left(bad).count(u'\n')) + 1;
    return failure(QStringLiteral("%1, line %2: U+%3 cannot be written in the ANSI code page (Windows-1252)")
                       .arg(fileName)
                       .arg(line)
                       .arg(job.text[bad].unicode(), 4, 16, QLatin1Char('0')));
  }
  // The IDE model reads modules from files: the text goes into one of its own, under the module's name.
  QTemporaryDir folder;
  const QString copy = folder.filePath(fileName);
  QFile file(copy);
  if (!folder.isValid() || !file.open(QIODevice::WriteOnly) || file.write(*bytes) != bytes->size() ||
      !file.flush())
    return failure(
        QStringLiteral("cannot keep a copy of %1 to work on: %2").arg(fileName, file.errorString()));
  file.close();

  try {
    const auto vbe = host::VbeImpl::create();
    const auto project = vbe->openModuleFile(copy);
    const auto component = project->components().front();
    const ide::Ref<ide::CodeModule> module = component->codeModule();
    if (!module) return std::vector<TextEdit>{};
    ide::Ref<ide::Member> member;
    if (!job.procedure.isEmpty()) {
      member = module->Members()->Item(job.procedure);
      const ide::MemberType type = member->Type();
      if (type != ide::MemberType::Method && type != ide::MemberType::Property)
        return failure(QStringLiteral("%1 is no procedure of %2").arg(job.procedure, fileName));
    }
    walk::WalkContext context(QStringLiteral("quimbel"), nullptr, nullptr);
    std::optional<walk::WalkFailure> failed;
    const auto note = [&](const walk::WalkFailure& what) {
      if (!failed) failed = what;
    };
    context.onFailure = note;
    context.onLineSkipped = note;
    walkModule(context, module, member, job);
    if (failed) {
      const QString what = failed->stopsRun ? QStringLiteral("line numbers would pass 2147483647")
                                            : failed->error.description();
      return failure(failed->line > 0
                         ? QStringLiteral("%1, code line %2: %3").arg(fileName).arg(failed->line).arg(what)
                         : QStringLiteral("%1: %2").arg(fileName, what));
    }
    if (!component->IsDirty()) return std::vector<TextEdit>{};
    const auto after = component->fileContents(true);
    if (!after) return std::vector<TextEdit>{};
    return lineEdits(job.text, host::decodeAnsi(*after));
  } catch (const ide::Error& error) {
    return failure(QString(error.description()).replace(copy, fileName));
  }
}

}  // namespace lsp
