// SPDX-License-Identifier: MIT
// The walk context and the helpers the walks share.
#include "walk/walk.h"

#include "common/errors.h"
#include "syntax/line.h"

namespace walk {

WalkContext::WalkContext(QString owner, ide::EventLoop* loop, ProgressSink* bar)
    : m_owner(std::move(owner)), m_loop(loop), m_bar(bar) {
  if (m_bar) m_scale.emplace(*m_bar);
}

void WalkContext::yield() {
  if (!m_loop) return;
  if (m_lastYield && Clock::now() - *m_lastYield < m_yieldInterval) return;
  m_loop->DoEvents();
  // Measured after the loop ran, so that a slow repaint still leaves the walk its share of the time.
  m_lastYield = Clock::now();
}

bool WalkContext::yieldAndCheck() {
  yield();
  if (m_cancel) {
    hideProgress();
    return true;
  }
  return m_stopped;
}

void WalkContext::reset() {
  m_cancel = false;
  m_stopped = false;
  m_line = 0;
  m_lastYield.reset();
}

void WalkContext::SetProgressRange(qint32 units) {
  if (m_scale) m_scale->SetProgressRange(units);
}

void WalkContext::AdvanceProgress(qint32 units) {
  if (m_scale) m_scale->AdvanceProgress(units);
}

void WalkContext::showProgress() {
  if (m_bar) m_bar->setVisible(true);
}

void WalkContext::hideProgress() {
  if (m_bar && m_bar->isVisible()) m_bar->setVisible(false);
}

bool WalkContext::endsRun(const std::exception& failure) {
  return dynamic_cast<const RunStopped*>(&failure) != nullptr;
}

WalkFailure WalkContext::record(const std::exception& failure, QStringView operation, int messageId,
                                ide::CodeModule* module, int line) {
  QString moduleName;
  if (module) {
    try {
      moduleName = module->Name();
    } catch (const std::exception&) {
      // A module that left the IDE has no name to report; the failure itself still counts.
    }
  }
  const QString name = operation.toString();
  return WalkFailure{
      name, messageId, moduleName, line, common::recordError(failure, m_owner, name, line), endsRun(failure)};
}

void WalkContext::failed(const std::exception& failure, QStringView operation, int messageId,
                         ide::CodeModule* module) {
  const WalkFailure report = record(failure, operation, messageId, module, m_line);
  if (report.stopsRun) m_stopped = true;
  if (onFailure) onFailure(report);
}

void WalkContext::lineSkipped(const std::exception& failure, QStringView operation, ide::CodeModule& module,
                              int line) {
  if (endsRun(failure)) throw;
  if (onLineSkipped) onLineSkipped(record(failure, operation, 0, &module, line));
}

// ---------------------------------------------------------------------------------------------------

namespace {

bool isRelatedDocument(ide::VBComponent& component) {
  return component.Type() == ide::ComponentType::RelatedDocument;
}

// The units of one module; a module that fails to answer counts nothing.
qint32 moduleUnits(const ide::Ref<ide::CodeModule>& module, ProgressUnit unit) {
  if (!module) return 0;
  try {
    if (unit == ProgressUnit::Members) return module->Members()->Count();
    return module->CountOfLines() - module->CountOfDeclarationLines();
  } catch (const std::exception&) {
    return 0;
  }
}

qint32 componentUnits(const ide::Ref<ide::VBComponent>& component, ProgressUnit unit) {
  if (!component) return 0;
  try {
    if (isRelatedDocument(*component)) return 0;
    return moduleUnits(component->CodeModule(), unit);
  } catch (const std::exception&) {
    return 0;
  }
}

}  // namespace

qint32 CountUnits(WalkContext& context, ide::VBE& vbe, PROG_MODE scope, ProgressUnit unit) {
  qint64 units = 0;
  switch (scope) {
    case PROG_PROJECT:
      if (auto project = vbe.ActiveVBProject()) {
        try {
          for (const auto& component : project->VBComponents()->items())
            units += componentUnits(component, unit);
        } catch (const std::exception&) {
          // Counting only sizes the bar: a project that cannot be listed shows an empty one.
        }
      }
      break;
    case PROG_MODULE:
      units = componentUnits(vbe.SelectedVBComponent(), unit);
      break;
    default:
      units = 1;
      break;
  }
  const qint32 total = qint32(std::min<qint64>(units, std::numeric_limits<qint32>::max()));
  context.SetProgressRange(total);
  context.showProgress();
  context.yield();
  return total;
}

ide::Ref<ide::VBProject> activeProject(ide::VBE& vbe) {
  auto project = vbe.ActiveVBProject();
  if (!project) ide::raise(ide::err::ObjectVariableNotSet);
  return project;
}

ide::Ref<ide::VBComponent> selectedComponent(ide::VBE& vbe) {
  auto component = vbe.SelectedVBComponent();
  if (!component) ide::raise(ide::err::ObjectVariableNotSet);
  return component;
}

ide::Ref<ide::CodePane> activeCodePane(ide::VBE& vbe) {
  auto pane = vbe.ActiveCodePane();
  if (!pane) ide::raise(ide::err::ObjectVariableNotSet);
  return pane;
}

ProcedureRef currentProcedure(ide::VBE& vbe) {
  auto pane = activeCodePane(vbe);
  auto window = pane->Window();
  if (window && window->WindowState() == ide::WindowState::Minimize)
    window->setWindowState(ide::WindowState::Normal);
  int startLine = 0, startColumn = 0, endLine = 0, endColumn = 0;
  pane->GetSelection(startLine, startColumn, endLine, endColumn);
  ProcedureRef procedure;
  procedure.module = pane->CodeModule();
  if (!procedure.module) ide::raise(ide::err::ObjectVariableNotSet);
  procedure.name = procedure.module->ProcOfLine(startLine, procedure.kind).trimmed();
  if (procedure.name.isEmpty()) return procedure;
  // The procedure at the caret, not the first of its name: another may stand in an #If branch above.
  for (const ide::ProcExtent& extent : procedure.module->Procedures()) {
    if (startLine >= extent.startLine && startLine < extent.startLine + extent.countLines) {
      procedure.extent = extent;
      break;
    }
  }
  return procedure;
}

void forEachCodeModule(WalkContext& context, ide::VBProject& project,
                       const std::function<void(const ide::Ref<ide::CodeModule>&)>& visit) {
  auto components = project.VBComponents();
  const int count = components->Count();
  for (int i = 1; i <= count; ++i) {
    if (context.yieldAndCheck()) return;
    ide::Ref<ide::CodeModule> module;
    try {
      auto component = components->Item(i);
      if (isRelatedDocument(*component)) continue;
      module = component->CodeModule();
    } catch (const std::exception&) {
      continue;  // a component that cannot be read is left as it is
    }
    if (module) visit(module);
  }
}

bool forEachMember(WalkContext& context, ide::CodeModule& module,
                   const std::function<void(const ide::Ref<ide::Member>&)>& visit, QStringView guardEach) {
  auto members = module.Members();
  const int count = members->Count();
  for (int i = 1; i <= count; ++i) {
    if (context.yieldAndCheck()) return false;
    if (guardEach.isEmpty())
      visit(members->Item(i));
    else
      context.guard(guardEach, 0, &module, [&] { visit(members->Item(i)); });
  }
  return true;
}

namespace {
QString procedureKey(QStringView name, ide::ProcKind kind) {
  return name.toString().toCaseFolded() + QChar(u'0' + int(kind));
}
}  // namespace

ModuleProcedures::ModuleProcedures(ide::CodeModule& module)
    : m_module(&module), m_lines(module.CountOfLines()), m_procedures(module.Procedures()) {
  for (size_t i = 0; i < m_procedures.size(); ++i)
    m_byName[procedureKey(m_procedures[i].name, m_procedures[i].kind)].push_back(i);
}

void ModuleProcedures::forMember(ide::Member& member,
                                 const std::function<void(const ide::ProcExtent&)>& visit) const {
  const ide::MemberType type = member.Type();
  if (!hasProcedures(type)) return;
  const QString name = member.Name().trimmed();
  if (name.isEmpty()) return;
  const auto visitKind = [&](ide::ProcKind kind) {
    const auto found = m_byName.constFind(procedureKey(name, kind));
    if (found == m_byName.cend()) return;
    for (const size_t i : *found)
      visit(m_procedures[i]);
  };
  if (type == ide::MemberType::Property) {
    for (const ide::ProcKind kind : {ide::ProcKind::Get, ide::ProcKind::Let, ide::ProcKind::Set})
      visitKind(kind);
    return;
  }
  visitKind(ide::ProcKind::Proc);
}

std::optional<ide::ProcExtent> ModuleProcedures::find(QStringView name, ide::ProcKind kind) const {
  const auto found = m_byName.constFind(procedureKey(name.trimmed(), kind));
  if (found == m_byName.cend()) return std::nullopt;
  return m_procedures[found->front()];
}

ide::ProcExtent extentOf(ide::CodeModule& module, const QString& name, ide::ProcKind kind) {
  ide::ProcExtent extent;
  extent.name = name;
  extent.kind = kind;
  extent.bodyLine = module.ProcBodyLine(name, kind);
  extent.startLine = module.ProcStartLine(name, kind);
  extent.countLines = module.ProcCountLines(name, kind);
  // The header ends where its statement does, or after the alternatives the module knows it has.
  extent.headerEnd = extent.bodyLine;
  for (const ide::ProcExtent& known : module.Procedures()) {
    if (known.bodyLine == extent.bodyLine) return known;
  }
  return extent;
}

ProcedureText readProcedure(ide::CodeModule& module, const ide::ProcExtent& extent) {
  ProcedureText text;
  text.body = extent.bodyLine;
  text.count = extent.countLines;
  const int extentEnd = extent.startLine + text.count - 1;
  text.lines.reserve(size_t(std::max(1, extentEnd - text.body + 1)));
  for (int i = text.body; i <= std::max(text.body, extentEnd); ++i)
    text.lines.push_back(module.Lines(i, 1));
  const auto size = qsizetype(text.lines.size());

  text.first = 1;
  while (text.first < size && syntax::continues(text.lines[size_t(text.first - 1)]))
    ++text.first;
  if (extent.headerEnd - extent.bodyLine + 1 > text.first) {
    // Alternative headers under #If ... #Else: none of their lines is the body's.
    text.first = std::min<qsizetype>(size, extent.headerEnd - extent.bodyLine + 1);
    text.bodyFrom = text.first;
  }
  qsizetype last = size - 1;
  while (last > 0 && syntax::isBlankLine(text.lines[size_t(last)]))
    --last;
  // The End line is the first line that is no continuation and ends the procedure: the last procedure
  // owns the comments after it, which are not its code.
  qsizetype endLine = -1;
  bool continued = syntax::continues(text.lines[size_t(text.first - 1)]);
  for (qsizetype i = text.first; i < size && endLine < 0; ++i) {
    const QStringView line = text.lines[size_t(i)];
    if (!continued && syntax::isProcedureEnd(line)) endLine = i;
    continued = syntax::continues(line);
  }
  text.stop = endLine >= 0 ? endLine : last;
  text.unnumberStop = endLine >= 0 ? endLine : size - 1;
  // A one-line procedure has no body: what follows it up to the next header is not its code.
  if (syntax::endsProcedureAfterColon(text.lines[size_t(text.first - 1)]))
    text.stop = text.unnumberStop = text.first;
  return text;
}

QString declarationsText() {
  return QStringLiteral("(Declarations)");
}

}  // namespace walk
