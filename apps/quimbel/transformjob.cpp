// SPDX-License-Identifier: MIT
#include "transformjob.h"

#include "diff.h"
#include "host/files/modulefile.h"
#include "host/files/sourcelines.h"
#include "host/model/vbe.h"
#include "terminalprogress.h"

#include <QDir>
#include <QFile>

#include <memory>
#include <vector>

namespace cli {

namespace {

// One file from the command line, opened in an IDE of its own.
struct Input {
  QString file;
  std::shared_ptr<host::VbeImpl> vbe = host::VbeImpl::create();
  // Components of module files given on their own are shown under the path the user gave.
  QHash<QString, QString> givenPaths;

  QString shownPath(const host::ComponentImpl& component) const {
    return givenPaths.value(component.filePath(), QDir::current().relativeFilePath(component.filePath()));
  }
};

// Where a walk starts: a project, a module or a member of a module.
struct Target {
  Input* input = nullptr;
  ide::Ref<ide::VBProject> project;
  ide::Ref<ide::CodeModule> module;
  ide::Ref<ide::Member> member;
};

struct Snapshot {
  Input* input;
  std::shared_ptr<host::ComponentImpl> component;
  QStringList lines;
};

QStringList codeLines(host::CodeModuleImpl& module) {
  QStringList lines;
  const int count = module.CountOfLines();
  lines.reserve(count);
  for (int i = 1; i <= count; ++i)
    lines << module.text().line(i);
  return lines;
}

bool isRelatedDocument(host::ComponentImpl& component) {
  return component.Type() == ide::ComponentType::RelatedDocument;
}

std::vector<std::shared_ptr<host::ComponentImpl>> codeComponents(const Input& input) {
  std::vector<std::shared_ptr<host::ComponentImpl>> components;
  for (const auto& project : input.vbe->projects())
    for (const auto& component : project->components())
      if (component->codeModule() && !isRelatedDocument(*component)) components.push_back(component);
  return components;
}

// The modules named `name` (case aside) in every input.
std::vector<Target> findModules(std::vector<Input>& inputs, const QString& name) {
  std::vector<Target> targets;
  for (Input& input : inputs)
    for (const auto& component : codeComponents(input))
      if (component->Name().compare(name, Qt::CaseInsensitive) == 0)
        targets.push_back({&input, component->project(), component->codeModule(), {}});
  return targets;
}

std::optional<std::vector<Target>> findTargets(std::vector<Input>& inputs, const TransformOptions& options) {
  std::vector<Target> targets;
  if (!options.procedure.isEmpty()) {
    const qsizetype dot = options.procedure.indexOf(u'.');
    const QString moduleName = options.procedure.left(dot);
    const QString memberName = options.procedure.mid(dot + 1);
    if (dot <= 0 || memberName.isEmpty()) {
      printError(QStringLiteral("--procedure takes MODULE.NAME, not '%1'").arg(options.procedure));
      return std::nullopt;
    }
    for (Target& module : findModules(inputs, moduleName)) {
      try {
        module.member = module.module->Members()->Item(memberName);
      } catch (const ide::Error&) {
        continue;
      }
      const ide::MemberType type = module.member->Type();
      if (type == ide::MemberType::Method || type == ide::MemberType::Property) targets.push_back(module);
    }
    if (targets.empty())
      printError(QStringLiteral("no procedure '%1' in the files given").arg(options.procedure));
  } else if (!options.module.isEmpty()) {
    targets = findModules(inputs, options.module);
    if (targets.empty()) printError(QStringLiteral("no module '%1' in the files given").arg(options.module));
  } else {
    for (Input& input : inputs)
      for (const auto& project : input.vbe->projects())
        targets.push_back({&input, project, {}, {}});
  }
  if (targets.empty()) return std::nullopt;
  return targets;
}

qint64 unitsOf(const ide::Ref<ide::CodeModule>& module, transform::ProgressUnit unit) {
  if (unit == transform::ProgressUnit::Members) return module->Members()->Count();
  return module->CountOfLines() - module->CountOfDeclarationLines();
}

qint64 unitsOf(const Target& target, transform::ProgressUnit unit) {
  if (target.member) return 1;
  if (target.module) return unitsOf(target.module, unit);
  qint64 units = 0;
  for (const auto& component : codeComponents(*target.input))
    if (component->project() == target.project) units += unitsOf(component->codeModule(), unit);
  return units;
}

QString failureText(const transform::WalkFailure& failure) {
  const QString where =
      failure.line > 0 ? QStringLiteral("%1, line %2").arg(failure.module).arg(failure.line) : failure.module;
  const QString what =
      failure.stopsRun ? QStringLiteral("line numbers would pass 2147483647") : failure.error.description();
  return where.isEmpty() ? what : where + QStringLiteral(": ") + what;
}

DiffSide diffSide(const QByteArray& bytes, const QString& path) {
  DiffSide side;
  const std::vector<host::SourceLine> lines = host::readSourceLines(bytes, path);
  for (const host::SourceLine& line : lines)
    side.lines << line.text;
  side.missingFinalNewline = !lines.empty() && lines.back().end == host::LineEnd::None;
  return side;
}

// The file as saving the component would write it.
QByteArray fileAfter(host::ComponentImpl& component) {
  host::ModuleSource source = component.source();
  component.codeModule()->text().store(source.code, source.memberAttributes);
  return host::writeModule(source, component.filePath());
}

int printDiff(const Snapshot& changed) {
  QFile file(changed.component->filePath());
  if (!file.open(QIODevice::ReadOnly)) {
    printError(QStringLiteral("%1: cannot read: %2")
                   .arg(changed.input->shownPath(*changed.component), file.errorString()));
    return kInputError;
  }
  const QString path = changed.input->shownPath(*changed.component);
  for (const QString& line :
       unifiedDiff(path, diffSide(file.readAll(), path), diffSide(fileAfter(*changed.component), path)))
    printLine(line);
  return kSuccess;
}

}  // namespace

int runTransform(const TransformOptions& options,
                 const std::function<Walks(transform::WalkContext&)>& makeWalks) {
  // Made first: whether the run is long enough for a bar counts from the start, loading included.
  TerminalProgress bar;
  std::vector<Input> inputs(size_t(options.files.size()));
  for (qsizetype i = 0; i < options.files.size(); ++i) {
    Input& input = inputs[size_t(i)];
    input.file = options.files[i];
    try {
      for (const auto& project : input.vbe->open(input.file))
        if (project->FileName().isEmpty())
          for (const auto& component : project->components())
            input.givenPaths.insert(component->filePath(), input.file);
    } catch (const ide::Error& error) {
      printError(QStringLiteral("%1: %2").arg(input.file, error.description()));
      return kInputError;
    }
  }
  const auto targets = findTargets(inputs, options);
  if (!targets) return kUsageError;

  std::vector<Snapshot> snapshots;
  for (Input& input : inputs)
    for (const auto& component : codeComponents(input))
      snapshots.push_back({&input, component, codeLines(*component->codeModule())});

  int failures = 0;
  {
    transform::WalkContext context(QStringLiteral("quimbel"), nullptr, &bar);
    const Input* current = nullptr;
    const auto report = [&](const transform::WalkFailure& failure) {
      bar.setVisible(false);  // the message gets a line of its own
      printError(QStringLiteral("%1: %2").arg(current->file, failureText(failure)));
      bar.setVisible(true);
      ++failures;
    };
    context.onFailure = report;
    context.onLineSkipped = report;
    const Walks walks = makeWalks(context);
    qint64 units = 0;
    for (const Target& target : *targets)
      units += unitsOf(target, walks.unit);
    context.SetProgressRange(qint32(std::min<qint64>(units, std::numeric_limits<qint32>::max())));
    context.showProgress();
    for (const Target& target : *targets) {
      if (context.stopped()) break;
      current = target.input;
      if (target.member)
        walks.member(target.module, target.member);
      else if (target.module)
        walks.module(target.module);
      else
        walks.project(target.project);
    }
    context.hideProgress();
  }
  if (failures) {
    printError(QStringLiteral("nothing was written"));
    return kInputError;
  }

  std::vector<const Snapshot*> changed;
  for (const Snapshot& snapshot : snapshots)
    if (snapshot.component->IsDirty() && codeLines(*snapshot.component->codeModule()) != snapshot.lines)
      changed.push_back(&snapshot);

  if (options.diff) {
    for (const Snapshot* snapshot : changed)
      if (const int code = printDiff(*snapshot)) return code;
  } else if (options.check) {
    for (const Snapshot* snapshot : changed)
      printLine(QStringLiteral("would change %1").arg(snapshot->input->shownPath(*snapshot->component)));
  }
  if (options.check) return changed.empty() ? kSuccess : kWouldChange;
  if (options.diff) return kSuccess;

  // All files are replaced together, once every one of them is written: a failure changes none.
  host::SaveBatch batch;
  try {
    for (const Snapshot* snapshot : changed)
      snapshot->component->addToBatch(batch);
    batch.commit();
  } catch (const ide::Error& error) {
    printError(error.description());
    return kOutputError;
  }
  return kSuccess;
}

transform::NumberingOptions numberingOf(const TransformOptions& options) {
  const common::SettingsStore settings(common::SettingsStore::userStorePath());
  transform::NumberingOptions numbering = transform::storedNumbering(settings);
  if (options.start) numbering.startNumber = *options.start;
  if (options.interval) numbering.interval = *options.interval;
  return numbering;
}

transform::IndentationOptions indentationOf(const TransformOptions& options) {
  const common::SettingsStore settings(common::SettingsStore::userStorePath());
  transform::IndentationOptions indentation = transform::storedIndentation(settings);
  if (options.tabs) indentation.mode = transform::IndentMode::Tabs;
  if (options.spaces) {
    indentation.mode = transform::IndentMode::Spaces;
    indentation.spaces = *options.spaces;
  }
  return indentation;
}

}  // namespace cli
