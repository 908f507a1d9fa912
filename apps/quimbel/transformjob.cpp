// SPDX-License-Identifier: MIT
#include "transformjob.h"

#include "diff.h"
#include "host/files/modulefile.h"
#include "host/files/parallel.h"
#include "host/files/sourcelines.h"
#include "host/model/vbe.h"
#include "terminalprogress.h"

#include <QDir>
#include <QFile>

#include <algorithm>
#include <atomic>
#include <limits>
#include <memory>
#include <mutex>
#include <optional>
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

/// A walk's progress bar that only counts its steps (one per worker); `onChange` is told of every move.
class StepCounter final : public transform::ProgressSink {
 public:
  int minimum() const override { return m_minimum; }
  void setMinimum(int minimum) override { m_minimum = minimum; }
  int maximum() const override { return m_maximum; }
  void setMaximum(int maximum) override { m_maximum = maximum; }
  int value() const override { return m_value.load(std::memory_order_relaxed); }
  void setValue(int value) override {
    m_value.store(value, std::memory_order_relaxed);
    if (onChange) onChange();
  }
  bool isVisible() const override { return m_visible; }
  void setVisible(bool visible) override { m_visible = visible; }
  std::function<void()> onChange;

 private:
  int m_minimum = 0;
  int m_maximum = 1;
  std::atomic<int> m_value{0};
  bool m_visible = false;
};

// A module the run may change.
struct Walked {
  Input* input;
  std::shared_ptr<host::ComponentImpl> component;
};

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

// The line of the module's file that holds each code line (index 0: code line 1), as saving writes it:
// below the header, with the hidden attribute lines in between.
std::vector<int> fileLinesOf(host::ComponentImpl& component) {
  host::ModuleSource source = component.source();
  component.codeModule()->text().store(source.code, source.memberAttributes);
  std::vector<host::SourceLine> form;
  if (source.form) source.form->appendLines(form);
  int fileLine = int(source.preamble.size() + form.size() + source.moduleAttributes.size());
  std::vector<int> attributesAfter;
  for (const host::MemberAttributeLine& attribute : source.memberAttributes)
    attributesAfter.push_back(attribute.afterCodeLine);
  std::sort(attributesAfter.begin(), attributesAfter.end());
  std::vector<int> lines(source.code.size());
  auto attribute = attributesAfter.begin();
  for (size_t i = 0; i < lines.size(); ++i) {
    for (; attribute != attributesAfter.end() && *attribute <= int(i); ++attribute)
      ++fileLine;
    lines[i] = ++fileLine;
  }
  return lines;
}

// The file as saving the component would write it.
QByteArray fileAfter(host::ComponentImpl& component) {
  host::ModuleSource source = component.source();
  component.codeModule()->text().store(source.code, source.memberAttributes);
  return host::writeModule(source, component.filePath());
}

int printDiff(const Walked& changed) {
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
  // Deliberately never freed: the process ends right after the run, and taking a million lines apart one
  // by one would only delay its exit.
  std::vector<Input>& inputs = *new std::vector<Input>(size_t(options.files.size()));
  bool missing = false;
  for (qsizetype i = 0; i < options.files.size(); ++i) {
    Input& input = inputs[size_t(i)];
    input.file = options.files[i];
    if (!openInput(*input.vbe, input.file, input.givenPaths)) return kInputError;
    missing = reportMissingFiles(*input.vbe) || missing;
  }
  const auto targets = findTargets(inputs, options);
  if (!targets) return kUsageError;

  std::vector<Walked> walked;
  for (Input& input : inputs)
    for (const auto& component : codeComponents(input))
      walked.push_back({&input, component});

  // Whole projects are walked module by module: a project walk is nothing but the walks of its modules.
  // Each module's walk touches that module alone, so the modules are walked side by side on every core.
  std::vector<Target> units;
  for (const Target& target : *targets) {
    if (target.module) {
      units.push_back(target);
      continue;
    }
    for (const auto& component : codeComponents(*target.input))
      if (component->project() == target.project)
        units.push_back({target.input, target.project, component->codeModule(), {}});
  }

  qint64 totalUnits = 0;
  transform::ProgressUnit progressUnit = transform::ProgressUnit::Lines;
  {
    transform::WalkContext counting(QStringLiteral("quimbel"), nullptr, nullptr);
    progressUnit = makeWalks(counting).unit;
  }
  for (const Target& unit : units)
    totalUnits += unitsOf(unit, progressUnit);
  const qint32 range = qint32(std::min<qint64>(totalUnits, std::numeric_limits<qint32>::max()));

  struct Report {
    size_t unit;
    transform::WalkFailure failure;
  };
  std::mutex reportsMutex;
  std::vector<Report> reports;
  const size_t workers = host::threadsFor(units.size());
  // Every worker's bar counts its own steps; the first one shows the sum on the terminal.
  std::vector<std::unique_ptr<StepCounter>> counters;
  for (size_t w = 0; w < workers; ++w)
    counters.push_back(std::make_unique<StepCounter>());
  counters.front()->onChange = [&] {
    int steps = 0;
    for (const auto& counter : counters)
      steps += counter->value();
    bar.setValue(std::min(steps, bar.maximum()));
  };
  bar.setMinimum(0);
  bar.setMaximum(std::max(1, std::min<qint32>(range, transform::ProgressScale::kMaxSteps)));
  bar.setValue(0);
  bar.setVisible(true);
  host::WorkQueue queue(units.size());
  host::runWorkers(workers, [&](size_t worker) {
    transform::WalkContext context(QStringLiteral("quimbel"), nullptr, counters[worker].get());
    size_t current = 0;
    const auto report = [&](const transform::WalkFailure& failure) {
      const std::lock_guard lock(reportsMutex);
      reports.push_back({current, failure});
    };
    context.onFailure = report;
    context.onLineSkipped = report;
    const Walks walks = makeWalks(context);
    context.SetProgressRange(range);
    while (queue.take(current)) {
      if (context.stopped()) break;
      const Target& unit = units[current];
      if (unit.member)
        walks.member(unit.module, unit.member);
      else
        walks.module(unit.module);
    }
  });
  bar.setVisible(false);
  // Reported in the order a walk of one module after the other would have met them.
  std::stable_sort(reports.begin(), reports.end(),
                   [](const Report& a, const Report& b) { return a.unit < b.unit; });
  std::optional<size_t> linesOfUnit;
  std::vector<int> fileLines;
  for (const Report& report : reports) {
    const Target& unit = units[report.unit];
    auto module = std::dynamic_pointer_cast<host::CodeModuleImpl>(unit.module);
    auto component = module ? module->component() : nullptr;
    const int line = report.failure.line;
    if (!component || line <= 0 ||
        report.failure.module.compare(component->Name(), Qt::CaseInsensitive) != 0) {
      printError(QStringLiteral("%1: %2").arg(unit.input->file, failureText(report.failure)));
      continue;
    }
    if (linesOfUnit != report.unit) {
      fileLines = fileLinesOf(*component);
      linesOfUnit = report.unit;
    }
    // Where the line is in the file as well as in the code window.
    printError(QStringLiteral("%1, line %2: %3")
                   .arg(unit.input->shownPath(*component))
                   .arg(size_t(line) <= fileLines.size() ? fileLines[size_t(line) - 1] : 0)
                   .arg(failureText(report.failure)));
  }
  const size_t failures = reports.size();
  if (failures) {
    printError(QStringLiteral("nothing was written"));
    return kInputError;
  }

  // The walks replace a line only when its text changes, so a module with edits is a module that changed.
  std::vector<const Walked*> changed;
  for (const Walked& module : walked)
    if (module.component->IsDirty()) changed.push_back(&module);

  if (options.diff) {
    for (const Walked* module : changed)
      if (const int code = printDiff(*module)) return code;
  } else if (options.check) {
    for (const Walked* module : changed)
      printLine(QStringLiteral("would change %1").arg(module->input->shownPath(*module->component)));
  }
  if (options.check) return withMissingFiles(changed.empty() ? kSuccess : kWouldChange, missing);
  if (options.diff) return withMissingFiles(kSuccess, missing);

  // All files are replaced together, once every one of them is written: a failure changes none.
  host::SaveBatch batch;
  try {
    std::vector<std::shared_ptr<host::ComponentImpl>> components;
    for (const Walked* module : changed)
      components.push_back(module->component);
    host::addToBatch(batch, components);
    batch.commit();
  } catch (const host::FilesChangedOnDisk& error) {
    for (const QString& path : error.changed)
      printError(QStringLiteral("%1: changed by another program since it was read").arg(path));
    for (const QString& path : error.deleted)
      printError(QStringLiteral("%1: deleted by another program since it was read").arg(path));
    printError(QStringLiteral("nothing was written"));
    return kOutputError;
  } catch (const host::SaveHalfDone& error) {
    printError(error.description());
    return kPartlyWritten;
  } catch (const ide::Error& error) {
    printError(error.description());
    return kOutputError;
  }
  return withMissingFiles(kSuccess, missing);
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
