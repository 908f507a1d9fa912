// SPDX-License-Identifier: MIT
// What the numbering and indentation commands share: opening the files (or standard input), finding the
// scope and the style in force for each module, walking it with a progress bar, and then writing the
// changed files, printing a diff or checking.
#include "cli.h"
#include "diff.h"
#include "fileio/fileio.h"
#include "fileio/parallel.h"
#include "host/files/modulefile.h"
#include "host/files/sourcelines.h"
#include "host/model/vbe.h"
#include "terminalprogress.h"
#include "transform/indentwalk.h"
#include "transform/numberwalk.h"
#include "transform/numindent.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QSet>
#include <QTemporaryDir>

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

// Where a walk starts: a module, or a member of a module.
struct Target {
  Input* input = nullptr;
  ide::Ref<ide::VBProject> project;
  ide::Ref<ide::CodeModule> module;
  ide::Ref<ide::Member> member;
};

/// A worker's share of the terminal's bar: the bytes of the modules it finished, and the part of its
/// current module that the walk's bar (this one) shows done. Read by another worker while it moves.
class WorkerBar final : public walk::ProgressSink {
 public:
  int minimum() const override { return 0; }
  void setMinimum(int) override {}
  int maximum() const override { return m_maximum.load(std::memory_order_relaxed); }
  void setMaximum(int maximum) override { m_maximum.store(std::max(1, maximum), std::memory_order_relaxed); }
  int value() const override { return m_value.load(std::memory_order_relaxed); }
  void setValue(int value) override {
    m_value.store(value, std::memory_order_relaxed);
    if (onChange) onChange();
  }
  bool isVisible() const override { return false; }
  void setVisible(bool) override {}

  void startModule(qint64 bytes) { m_current.store(bytes, std::memory_order_relaxed); }
  void finishModule() {
    m_done.fetch_add(m_current.exchange(0, std::memory_order_relaxed), std::memory_order_relaxed);
    setValue(0);
  }
  qint64 bytesDone() const {
    return m_done.load(std::memory_order_relaxed) + m_current.load() * value() / maximum();
  }
  std::function<void()> onChange;

 private:
  std::atomic<int> m_maximum{1};
  std::atomic<int> m_value{0};
  std::atomic<qint64> m_current{0};
  std::atomic<qint64> m_done{0};
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

host::ComponentImpl* componentOf(const ide::Ref<ide::CodeModule>& module) {
  auto impl = std::dynamic_pointer_cast<host::CodeModuleImpl>(module);
  return impl ? impl->component().get() : nullptr;
}

// The modules named `name` (case aside) among `walked`.
std::vector<Target> findModules(const std::vector<Walked>& walked, const QString& name) {
  std::vector<Target> targets;
  for (const Walked& module : walked)
    if (module.component->Name().compare(name, Qt::CaseInsensitive) == 0)
      targets.push_back({module.input, module.component->project(), module.component->codeModule(), {}});
  return targets;
}

/// Every module of the scope, or the members --procedure names.
std::optional<std::vector<Target>> findTargets(const std::vector<Walked>& walked,
                                               const TransformOptions& options) {
  std::vector<Target> targets;
  if (!options.procedure.isEmpty()) {
    const qsizetype dot = options.procedure.indexOf(u'.');
    const QString moduleName = options.procedure.left(dot);
    const QString memberName = options.procedure.mid(dot + 1);
    if (dot <= 0 || memberName.isEmpty()) {
      printError(QStringLiteral("--procedure takes MODULE.NAME, not '%1'").arg(options.procedure));
      return std::nullopt;
    }
    for (Target& module : findModules(walked, moduleName)) {
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
    targets = findModules(walked, options.module);
    if (targets.empty()) printError(QStringLiteral("no module '%1' in the files given").arg(options.module));
  } else {
    for (const Walked& module : walked)
      targets.push_back({module.input, module.component->project(), module.component->codeModule(), {}});
  }
  if (targets.empty()) return std::nullopt;
  return targets;
}

/// The walk a module gets: the command's, or number-and-indent where the style joins the two.
struct Effective {
  TransformKind kind;
  bool add = true;
};

Effective effectiveKind(TransformKind kind, const codestyle::Style& style, bool remove) {
  if (kind == TransformKind::NumIndent) return {kind, !remove};
  if (!style.numIndent.value) return {kind, kind != TransformKind::Unnumber};
  return {TransformKind::NumIndent, kind != TransformKind::Unnumber};
}

walk::ProgressUnit progressUnitOf(const Effective& walk) {
  return walk.kind == TransformKind::Number || walk.kind == TransformKind::Unnumber
             ? walk::ProgressUnit::Members
             : walk::ProgressUnit::Lines;
}

qint64 unitsOf(const Target& target, walk::ProgressUnit unit) {
  if (target.member) return 1;
  if (unit == walk::ProgressUnit::Members) return target.module->Members()->Count();
  return target.module->CountOfLines() - target.module->CountOfDeclarationLines();
}

/// Walks one module (or one member of it) as `walk` says, with `style`. With `numberOf`, numbered lines
/// get the number it gives their module line.
void walkTarget(walk::WalkContext& context, const Target& target, const Effective& walk,
                const codestyle::Style& style, std::function<qint32(int)> numberOf) {
  const transform::NumberingOptions numbering = style.numbering();
  const transform::IndentationOptions indentation = style.indentation();
  switch (walk.kind) {
    case TransformKind::Number:
    case TransformKind::Unnumber: {
      transform::NumberingWalk numberingWalk(context, numbering.startNumber, numbering.interval);
      numberingWalk.setLineNumbers(std::move(numberOf));
      if (target.member)
        numberingWalk.NumberMember(target.module, target.member, walk.add);
      else
        numberingWalk.NumberModule(target.module, walk.add);
      return;
    }
    case TransformKind::Indent: {
      transform::IndentationWalk indentationWalk(context, indentation.mode, indentation.spaces);
      if (target.member)
        indentationWalk.IndentMember(target.module, target.member);
      else
        indentationWalk.IndentModule(target.module);
      return;
    }
    case TransformKind::NumIndent: {
      transform::NumIndentWalk both(context, numbering.startNumber, numbering.interval, indentation.mode,
                                    indentation.spaces, walk.add);
      both.numbering().setLineNumbers(std::move(numberOf));
      if (target.member)
        both.NumIndentMember(target.module, target.member);
      else
        both.NumIndentModule(target.module);
      return;
    }
  }
}

QString failureText(const walk::WalkFailure& failure) {
  const QString where =
      failure.line > 0 ? QStringLiteral("%1, line %2").arg(failure.module).arg(failure.line) : failure.module;
  const QString what =
      failure.stopsRun ? QStringLiteral("line numbers would pass 2147483647") : failure.error.description();
  return where.isEmpty() ? what : where + QStringLiteral(": ") + what;
}

// The file as saving the component would write it.
QByteArray fileAfter(host::ComponentImpl& component) {
  host::ModuleSource source = component.source();
  component.codeModule()->text().store(source.code, source.memberAttributes);
  return host::writeModule(source, component.filePath());
}

/// Standard input: one module, put in a folder of its own under the name it stands for.
struct StandardInput {
  QTemporaryDir folder;
  QString name;  // as given, or a standard module in the current folder
  QString path;  // the copy that the IDE opens
  QByteArray bytes;
};

bool readStandardInput(StandardInput& input, const QString& stdinName) {
  input.name = stdinName.isEmpty() ? QStringLiteral("stdin.bas") : stdinName;
  QFile in;
  if (!in.open(stdin, QIODevice::ReadOnly) || !input.folder.isValid()) {
    printError(QStringLiteral("cannot read standard input"));
    return false;
  }
  input.bytes = in.readAll();
  input.path = input.folder.filePath(QFileInfo(input.name).fileName());
  QFile copy(input.path);
  if (!copy.open(QIODevice::WriteOnly) || copy.write(input.bytes) != input.bytes.size() || !copy.flush()) {
    printError(
        QStringLiteral("cannot keep standard input in %1: %2").arg(input.folder.path(), copy.errorString()));
    return false;
  }
  return true;
}

}  // namespace

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

int runTransform(const TransformOptions& options, TransformKind kind) {
  useEncoding(options.input);
  // Made first: whether the run is long enough for a bar counts from the start, loading included.
  TerminalProgress bar;
  const bool fromStdin = options.input.files == QStringList{QStringLiteral("-")};
  std::optional<StandardInput> standardInput;
  QStringList files;
  if (fromStdin) {
    if (!readStandardInput(standardInput.emplace(), options.stdinName)) return kInputError;
    files << standardInput->path;
  } else if (const auto expanded = expandInputs(options.input)) {
    files = *expanded;
  } else {
    return kInputError;
  }

  std::vector<Input> inputs(size_t(files.size()));
  int missing = 0;
  for (qsizetype i = 0; i < files.size(); ++i) {
    Input& input = inputs[size_t(i)];
    input.file = files[i];
    // Each module's lines are made when its walk starts and freed once its file is written.
    input.vbe->setReadsCodeOnDemand(true);
    if (!openInput(*input.vbe, input.file, input.givenPaths, fromStdin ? standardInput->name : QString()))
      return kInputError;
    missing += reportMissingFiles(*input.vbe);
  }

  // Each module once, however often it was named (directly, by several projects, through a link).
  std::vector<Walked> walked;
  QSet<QString> seen;
  for (Input& input : inputs)
    for (const auto& component : codeComponents(input)) {
      if (options.input.exclusions.excludes(component->filePath())) continue;
      const QString identity = fileIdentity(component->filePath());
      if (seen.contains(identity)) continue;
      seen.insert(identity);
      walked.push_back({&input, component});
    }
  const auto found = findTargets(walked, options);
  if (!found) return kUsageError;
  const std::vector<Target>& units = *found;

  // The style in force for each module: the command line, its .editorconfig files, the settings.
  const common::SettingsStore settings(common::SettingsStore::userStorePath());
  const codestyle::Resolver resolver(options.style, &settings);
  std::vector<codestyle::Style> styles;
  std::vector<Effective> walks;
  std::vector<qint64> sizes;  // what each unit weighs on the bar: its file's size
  qint64 totalSize = 0;
  for (const Target& unit : units) {
    host::ComponentImpl* component = componentOf(unit.module);
    const QString stylePath =
        fromStdin ? QFileInfo(standardInput->name).absoluteFilePath() : component->filePath();
    const auto style = resolver.styleFor(stylePath);
    if (const auto* error = std::get_if<codestyle::StyleError>(&style)) {
      printError(styleErrorText(*error));
      printError(QStringLiteral("nothing was written"));
      return kInputError;
    }
    styles.push_back(std::get<codestyle::Style>(style));
    walks.push_back(effectiveKind(kind, styles.back(), options.remove));
    const auto stamp = component->fileStamp();
    sizes.push_back(std::max<qint64>(1, stamp ? stamp->size : 0));
    totalSize += sizes.back();
  }
  for (const Walked& module : walked)
    if (module.component->looksLikeUtf8())
      warnUtf8(fromStdin ? standardInput->name : module.input->shownPath(*module.component));

  struct Report {
    size_t unit;
    walk::WalkFailure failure;
  };
  std::mutex reportsMutex;
  std::vector<Report> reports;
  // Written as each module is done, so that a module's lines are freed as soon as its walk ends; put in
  // place together at the end, or not at all.
  const bool writing = !fromStdin && !options.check && !options.diff;
  host::SaveBatch batch;
  std::mutex batchMutex;
  std::exception_ptr writeFailure;
  std::atomic<bool> stopping{false};
  const size_t workers = fileio::threadsFor(units.size());
  // Every worker has a bar of its own; the first one shows the sum on the terminal.
  std::vector<std::unique_ptr<WorkerBar>> workerBars;
  for (size_t w = 0; w < workers; ++w)
    workerBars.push_back(std::make_unique<WorkerBar>());
  bar.setMinimum(0);
  bar.setMaximum(walk::ProgressScale::kMaxSteps);
  workerBars.front()->onChange = [&] {
    qint64 done = 0;
    for (const auto& workerBar : workerBars)
      done += workerBar->bytesDone();
    bar.setValue(int(std::min<qint64>(walk::ProgressScale::kMaxSteps, done * walk::ProgressScale::kMaxSteps /
                                                                          std::max<qint64>(1, totalSize))));
  };
  bar.setValue(0);
  bar.setVisible(true);
  // Each module's walk touches that module alone, so the modules are walked side by side on every core.
  fileio::WorkQueue queue(units.size());
  fileio::runWorkers(workers, [&](size_t worker) {
    WorkerBar& workerBar = *workerBars[worker];
    walk::WalkContext context(QStringLiteral("quimbel"), nullptr, &workerBar);
    size_t current = 0;
    bool unitFailed = false;
    const auto report = [&](const walk::WalkFailure& failure) {
      unitFailed = true;
      const std::lock_guard lock(reportsMutex);
      reports.push_back({current, failure});
    };
    context.onFailure = report;
    context.onLineSkipped = report;
    while (queue.take(current)) {
      if (context.stopped() || stopping.load()) break;
      const Target& unit = units[current];
      host::ComponentImpl& component = *componentOf(unit.module);
      unitFailed = false;
      workerBar.startModule(sizes[current]);
      context.SetProgressRange(qint32(std::min<qint64>(unitsOf(unit, progressUnitOf(walks[current])),
                                                       std::numeric_limits<qint32>::max())));
      std::function<qint32(int)> numberOf;
      if (options.fileLines && walks[current].add && walks[current].kind != TransformKind::Indent) {
        auto lines = std::make_shared<std::vector<int>>(fileLinesOf(component));
        numberOf = [lines](int moduleLine) { return qint32(lines->at(size_t(moduleLine) - 1)); };
      }
      walkTarget(context, unit, walks[current], styles[current], std::move(numberOf));
      workerBar.finishModule();
      // A module with failures keeps its lines: the report names their places in the file.
      if (!writing || unitFailed) continue;
      try {
        std::optional<QByteArray> contents = component.fileContents();
        if (contents) {
          const std::lock_guard lock(batchMutex);
          batch.add({component.filePath(), *contents, component.fileStamp()}, component.whenWritten());
        }
        component.unloadCode(contents ? &*contents : nullptr);
      } catch (...) {
        const std::lock_guard lock(batchMutex);
        if (!writeFailure) writeFailure = std::current_exception();
        stopping = true;
      }
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
    host::ComponentImpl* component = componentOf(unit.module);
    const int line = report.failure.line;
    if (!component || line <= 0 ||
        report.failure.module.compare(component->Name(), Qt::CaseInsensitive) != 0) {
      printError(QStringLiteral("%1: %2").arg(
          component ? unit.input->shownPath(*component) : unit.input->file, failureText(report.failure)));
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
  if (!reports.empty()) {
    printError(QStringLiteral("nothing was written"));
    return kInputError;
  }

  // The walks replace a line only when its text changes, so a module with edits is a module that changed.
  std::vector<const Walked*> changed;
  for (const Walked& module : walked)
    if (module.component->IsDirty()) changed.push_back(&module);

  if (fromStdin && !options.check && !options.diff) {
    printBytes(changed.empty() ? standardInput->bytes : fileAfter(*changed.front()->component));
    return kSuccess;
  }
  if (options.diff) {
    for (const Walked* module : changed) {
      const QString path = module->input->shownPath(*module->component);
      QByteArray before;
      try {
        before = fromStdin ? standardInput->bytes : fileio::readFileBytes(module->component->filePath());
      } catch (const ide::Error& error) {
        printError(namingFileOnce(path, error.description()));
        return kInputError;
      }
      printBytes(unifiedDiff(QFile::encodeName(path), before, fileAfter(*module->component)));
    }
  } else if (options.check) {
    for (const Walked* module : changed)
      printLine(QStringLiteral("would change %1").arg(module->input->shownPath(*module->component)));
  }
  // With files missing, the exit code says so; the result of the run is told here.
  const auto summary = [&](const char* what) {
    if (missing)
      printSummary(QStringLiteral("%1 %2 %3, %4 missing")
                       .arg(changed.size())
                       .arg(changed.size() == 1 ? QStringLiteral("file") : QStringLiteral("files"))
                       .arg(QLatin1StringView(what))
                       .arg(missing));
  };
  if (options.check || options.diff) {
    summary("would change");
    return withMissingFiles(options.check && !changed.empty() ? kWouldChange : kSuccess, missing > 0);
  }

  // All files are replaced together, once every one of them is written: a failure changes none.
  try {
    if (writeFailure) std::rethrow_exception(writeFailure);
    batch.commit();
  } catch (const fileio::FilesChangedOnDisk& error) {
    for (const QString& path : error.changed)
      printError(QStringLiteral("%1: changed by another program since it was read").arg(path));
    for (const QString& path : error.deleted)
      printError(QStringLiteral("%1: deleted by another program since it was read").arg(path));
    printError(QStringLiteral("nothing was written"));
    return kOutputError;
  } catch (const fileio::SaveHalfDone& error) {
    printError(error.description());
    return kPartlyWritten;
  } catch (const ide::Error& error) {
    printError(error.description());
    return kOutputError;
  }
  summary("changed");
  return withMissingFiles(kSuccess, missing > 0);
}

}  // namespace cli
