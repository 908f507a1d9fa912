// SPDX-License-Identifier: MIT
#include "lsp/rewrite.h"

#include "host/files/ansi.h"
#include "host/model/vbe.h"
#include "ide/error.h"
#include "transform/indentwalk.h"
#include "transform/numberwalk.h"
#include "transform/numindent.h"

#include <QFileInfo>

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

/// Where the line that starts at `from` ends (its text, before the line end) and where the next begins.
std::pair<qsizetype, qsizetype> lineAt(QByteArrayView bytes, qsizetype from) {
  qsizetype end = from;
  while (end < bytes.size() && bytes[end] != '\n' && bytes[end] != '\r')
    ++end;
  qsizetype next = end;
  if (next < bytes.size())
    next += bytes[next] == '\r' && next + 1 < bytes.size() && bytes[next + 1] == '\n' ? 2 : 1;
  return {end, next};
}

/// The edits from `before` to `after`, files of the same lines in the ANSI code page: per changed line, the
/// part that changed. A byte of the code page is one UTF-16 unit, so byte columns are the protocol's.
std::variant<std::vector<TextEdit>, Failure> lineEdits(QByteArrayView before, QByteArrayView after) {
  std::vector<TextEdit> edits;
  qsizetype a = 0;
  qsizetype b = 0;
  for (int line = 0; a < before.size() || b < after.size(); ++line) {
    if (a >= before.size() || b >= after.size())
      return failure(QStringLiteral("the walk changed the number of lines"));
    const auto [aEnd, aNext] = lineAt(before, a);
    const auto [bEnd, bNext] = lineAt(after, b);
    const QByteArrayView old = before.sliced(a, aEnd - a);
    const QByteArrayView now = after.sliced(b, bEnd - b);
    a = aNext;
    b = bNext;
    if (old == now) continue;
    qsizetype prefix = 0;
    while (prefix < old.size() && prefix < now.size() && old[prefix] == now[prefix])
      ++prefix;
    qsizetype suffix = 0;
    while (suffix < old.size() - prefix && suffix < now.size() - prefix &&
           old[old.size() - 1 - suffix] == now[now.size() - 1 - suffix])
      ++suffix;
    edits.push_back({{{line, int(prefix)}, {line, int(old.size() - suffix)}},
                     host::decodeAnsi(now.sliced(prefix, now.size() - prefix - suffix))});
  }
  return edits;
}

}  // namespace

struct ModuleRewriter::Model {
  std::shared_ptr<host::VbeImpl> vbe;
};

ModuleRewriter::ModuleRewriter() = default;
ModuleRewriter::~ModuleRewriter() = default;

void ModuleRewriter::release() {
  m_last.reset();
}

std::variant<std::vector<TextEdit>, Failure> ModuleRewriter::rewrite(const RewriteJob& job) {
  release();
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
  // The model takes the editor's text as the module's file, which is neither read nor written.
  m_last = std::make_unique<Model>();
  const QString path = QFileInfo(job.path).absoluteFilePath();
  try {
    m_last->vbe = host::VbeImpl::create();
    const auto project = m_last->vbe->openModuleFile(path, &*bytes);
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
    return lineEdits(*bytes, *after);
  } catch (const ide::Error& error) {
    return failure(QString(error.description()).replace(path, fileName));
  }
}

}  // namespace lsp
