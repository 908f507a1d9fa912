// SPDX-License-Identifier: MIT
// `quimbel tasks` and `quimbel favorites`: a project's task list and favourites, read from (and for tasks
// written to) the same info file the add-in keeps beside the project. The tool finds the file through the
// project's identifier module and never inserts one. A project without the module, or whose file is not
// beside it, has no info file: listing says so with an exit code of its own, not as an empty list.
#include "cli.h"
#include "host/model/vbe.h"
#include "projinfo/projinfo.h"
#include "projinfo/records.h"
#include "projinfo/storage/mdlstorage.h"
#include "projinfo/tasklist.h"

#include <QDir>
#include <QFileInfo>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QRegularExpression>

#include <algorithm>
#include <vector>

namespace cli {
namespace {

/// A project opened in a headless IDE, with its identifier when it has one.
struct OpenedProject {
  std::shared_ptr<host::VbeImpl> vbe = host::VbeImpl::create();
  std::shared_ptr<host::ProjectImpl> project;
  std::optional<projinfo::ProjectIdentity> identity;
  QString infoFile;
};

OpenedProject openProject(const QString& file) {
  OpenedProject opened;
  opened.project = opened.vbe->openProject(file);
  opened.identity = projinfo::FindProjectId(opened.project);
  if (opened.identity)
    opened.infoFile = QFileInfo(opened.project->FileName()).absolutePath() + u'/' +
                      projinfo::infoFileTitle(opened.identity->id);
  return opened;
}

/// A path below the current directory relative to it, any other in full.
QString shown(const QString& path) {
  const QString relative = QDir::current().relativeFilePath(path);
  return relative.startsWith(QLatin1StringView("..")) ? QDir::toNativeSeparators(path) : relative;
}

QString noIdentity(const QString& file) {
  return QStringLiteral(
             "%1: the project has no identifier module (basQMInf...), so it has no tasks or favorites yet; "
             "the add-in gives it one when the project is opened in the IDE")
      .arg(file);
}

/// A listing of a project without an info file: told, not taken for an empty list.
int noInfoFile(const OpenedProject& opened, const QString& file) {
  if (!opened.identity) {
    printError(noIdentity(file));
  } else {
    printError(QStringLiteral("%1: the project has no info file: %2 is not in its folder (it was never "
                              "written, or was moved or deleted; a project saved elsewhere while the "
                              "add-in was not loaded left it behind)")
                   .arg(file, shown(opened.infoFile)));
  }
  return kNoInfoFile;
}

/// Every record of one storage of the info file, by name; unreadable ones are reported and counted.
struct Records {
  std::vector<std::pair<QString, QString>> texts;
  int unreadable = 0;
};

Records readRecords(const QString& infoFile, const char* storageName) {
  Records records;
  auto root = projinfo::OpenDocFileForReading(infoFile);
  std::shared_ptr<projinfo::Storage> storage;
  try {
    storage = root->OpenStorage(QLatin1StringView(storageName), projinfo::STGM_READ);
  } catch (const ide::Error& error) {
    if (error.number() == projinfo::stg::FileNotFound) return records;  // none written yet
    throw;
  }
  for (const auto& element : storage->Elements()) {
    try {
      records.texts.emplace_back(
          element.Name(),
          storage->OpenStream(element.Name(), projinfo::STGM_READ)->ReadData(projinfo::vbString).toString());
    } catch (const ide::Error& error) {
      printError(QStringLiteral("%1: %2: %3").arg(shown(infoFile), element.Name(), error.description()));
      ++records.unreadable;
    }
  }
  return records;
}

/// The list as one JSON document: {"project": name, "<key>": [items]}.
void printJson(const QString& project, const char* key, const QJsonArray& items) {
  printBytes(jsonText(
      QJsonDocument(QJsonObject{{QStringLiteral("project"), project}, {QLatin1StringView(key), items}})));
}

int listTasks(const OpenedProject& opened, bool json) {
  Records records = readRecords(opened.infoFile, "TaskList");
  std::vector<projinfo::TaskRecord> tasks;
  for (const auto& [name, text] : records.texts) {
    try {
      tasks.push_back(projinfo::TaskRecord::fromText(text));
    } catch (const ide::Error& error) {
      printError(QStringLiteral("%1: %2: %3").arg(shown(opened.infoFile), name, error.description()));
      ++records.unreadable;
    }
  }
  std::sort(tasks.begin(), tasks.end(), [](const auto& a, const auto& b) { return a.ItemId < b.ItemId; });
  if (json) {
    QJsonArray items;
    for (const auto& task : tasks)
      items.append(QJsonObject{{QStringLiteral("id"), task.ItemId},
                               {QStringLiteral("done"), task.Done},
                               {QStringLiteral("name"), task.Name},
                               {QStringLiteral("text"), task.Text}});
    printJson(opened.project->Name(), "tasks", items);
    return records.unreadable ? kInputError : kSuccess;
  }
  printLine(tasks.empty()
                ? QStringLiteral("%1: no tasks").arg(opened.project->Name())
                : QStringLiteral("Tasks of %1 (%2):").arg(opened.project->Name(), shown(opened.infoFile)));
  for (const auto& task : tasks) {
    printLine(QStringLiteral("%1  [%2]  %3")
                  .arg(task.ItemId, 5)
                  .arg(QChar(task.Done ? u'x' : u' '))
                  .arg(task.Name));
    for (const QString& line :
         task.Text.split(QRegularExpression(QStringLiteral("\r\n|\r|\n")), Qt::SkipEmptyParts))
      printLine(QStringLiteral("           ") + line);
  }
  return records.unreadable ? kInputError : kSuccess;
}

/// Adds, ticks, unticks or removes a task, through the same objects the add-in uses.
int changeTasks(const OpenedProject& opened, const TaskOptions& options) {
  projinfo::ProjInfoServices services;
  services.vbe = opened.vbe.get();
  services.tellUser = false;
  projinfo::CProjInfo info(services);
  info.setProject(opened.project);
  try {
    info.InitializeExisting();
  } catch (const ide::Error& error) {
    printError(error.description());
    return error.number() == projinfo::stg::LockViolation ? kOutputError : kInputError;
  }
  projinfo::CTaskList& tasks = *info.TaskList();
  try {
    if (options.action == QLatin1StringView("add")) {
      if (options.name.trimmed().isEmpty()) {
        printError(QStringLiteral("a task needs a name"));
        return kUsageError;
      }
      auto task = std::make_shared<projinfo::CTaskItem>();
      task->Name = options.name;
      task->Text = options.text;
      tasks.AddTask(task);
      printLine(QStringLiteral("Added task %1 to %2.").arg(task->ItemId).arg(opened.project->Name()));
      return kSuccess;
    }
    const auto task =
        tasks.Tasks.Item(QLatin1StringView(projinfo::kTaskPrefix) + QString::number(options.id));
    if (!task) {
      printError(QStringLiteral("%1: no task %2").arg(shown(opened.infoFile)).arg(options.id));
      return kNoSuchTask;
    }
    if (options.action == QLatin1StringView("remove")) {
      tasks.DeleteTask(task->ItemId);
      printLine(QStringLiteral("Removed task %1.").arg(task->ItemId));
    } else {
      task->Done = options.action == QLatin1StringView("done");
      tasks.UpdateTask(*task);
      printLine(QStringLiteral("Task %1 is %2.")
                    .arg(task->ItemId)
                    .arg(task->Done ? QStringLiteral("done") : QStringLiteral("not done")));
    }
  } catch (const ide::Error& error) {
    printError(error.description());
    return kOutputError;
  }
  return kSuccess;
}

/// The line in the module (the code window's) a favourite stands for, as the add-in's window opens it, or
/// why there is none.
struct Place {
  int line = 0;
  QString missing;
};

Place placeOf(host::ProjectImpl& project, const projinfo::FavoriteRecord& favorite) {
  auto component = project.component(favorite.ComponentName);
  auto module = component ? component->codeModule() : nullptr;
  if (!module) return {0, QStringLiteral("module not in the project")};
  if (favorite.ProcedureName == QLatin1StringView("General Declarations"))
    return {std::min(favorite.Line, module->CountOfDeclarationLines()), {}};
  try {
    const auto kind = static_cast<ide::ProcKind>(favorite.ProcKind);
    const int start = module->ProcStartLine(favorite.ProcedureName, kind);
    const int count = module->ProcCountLines(favorite.ProcedureName, kind);
    return {favorite.Line < count ? start + favorite.Line : start + count - 1, {}};
  } catch (const ide::Error&) {
    return {0, QStringLiteral("procedure not found")};
  }
}

/// A project file is needed: tasks and favourites belong to a project, not to a module.
bool isProjectFile(const QString& file) {
  if (QFileInfo(file).suffix().compare(QLatin1StringView("vbp"), Qt::CaseInsensitive) == 0) return true;
  printError(
      QStringLiteral("%1: tasks and favorites belong to a project; give its project file (.vbp)").arg(file));
  return false;
}

}  // namespace

int runTasks(const TaskOptions& options) {
  if (!isProjectFile(options.project)) return kUsageError;
  const OpenedProject opened = openProject(options.project);
  if (options.action.isEmpty() && (!opened.identity || !QFileInfo::exists(opened.infoFile)))
    return noInfoFile(opened, options.project);
  if (!opened.identity) {
    printError(noIdentity(options.project));
    return kInputError;
  }
  try {
    return options.action.isEmpty() ? listTasks(opened, options.json) : changeTasks(opened, options);
  } catch (const ide::Error& error) {
    printError(error.description());
    return kInputError;
  }
}

int runFavorites(const TaskOptions& options) {
  if (!isProjectFile(options.project)) return kUsageError;
  const OpenedProject opened = openProject(options.project);
  if (!opened.identity || !QFileInfo::exists(opened.infoFile)) return noInfoFile(opened, options.project);
  Records records;
  try {
    records = readRecords(opened.infoFile, "Favorites");
  } catch (const ide::Error& error) {
    printError(error.description());
    return kInputError;
  }
  std::vector<projinfo::FavoriteRecord> favorites;
  for (const auto& [name, text] : records.texts) {
    try {
      favorites.push_back(projinfo::FavoriteRecord::fromText(text));
    } catch (const ide::Error& error) {
      printError(QStringLiteral("%1: %2: %3").arg(shown(opened.infoFile), name, error.description()));
      ++records.unreadable;
    }
  }
  std::sort(favorites.begin(), favorites.end(),
            [](const auto& a, const auto& b) { return a.ItemId < b.ItemId; });
  static const char* const kKinds[] = {"Procedure", "Property Let", "Property Set", "Property Get"};
  const auto kindOf = [](const projinfo::FavoriteRecord& favorite) {
    return favorite.ProcedureName == QLatin1StringView("General Declarations")
               ? QStringLiteral("Declarations")
           : favorite.ProcKind >= 0 && favorite.ProcKind <= 3 ? QString::fromLatin1(kKinds[favorite.ProcKind])
                                                              : QString::number(favorite.ProcKind);
  };
  if (options.json) {
    QJsonArray items;
    for (const auto& favorite : favorites) {
      const Place place = placeOf(*opened.project, favorite);
      items.append(QJsonObject{
          {QStringLiteral("id"), favorite.ItemId},
          {QStringLiteral("module"), favorite.ComponentName},
          {QStringLiteral("procedure"), favorite.ProcedureName},
          {QStringLiteral("kind"), kindOf(favorite)},
          {QStringLiteral("code_line"), place.missing.isEmpty() ? QJsonValue(place.line) : QJsonValue()}});
    }
    printJson(opened.project->Name(), "favorites", items);
    return records.unreadable ? kInputError : kSuccess;
  }
  printLine(
      favorites.empty()
          ? QStringLiteral("%1: no favorites").arg(opened.project->Name())
          : QStringLiteral("Favorites of %1 (%2):").arg(opened.project->Name(), shown(opened.infoFile)));
  for (const auto& favorite : favorites) {
    QString procedure = favorite.ProcedureName;
    if (favorite.ProcKind >= 1 && favorite.ProcKind <= 3)
      procedure += QStringLiteral(" (%1)").arg(QLatin1StringView(kKinds[favorite.ProcKind]));
    const Place found = placeOf(*opened.project, favorite);
    const QString place = found.missing.isEmpty() ? QStringLiteral("line %1").arg(found.line)
                                                  : QStringLiteral("(%1)").arg(found.missing);
    printLine(QStringLiteral("%1  %2  %3  %4")
                  .arg(favorite.ItemId, 5)
                  .arg(favorite.ComponentName, -20)
                  .arg(procedure, -30)
                  .arg(place));
  }
  return records.unreadable ? kInputError : kSuccess;
}

}  // namespace cli
