// SPDX-License-Identifier: MIT
#include "projinfo/projinfo.h"

#include "appdata/appinfofile.h"
#include "common/errors.h"
#include "common/strings.h"
#include "common/uiutils.h"
#include "projinfo/storage/mdlstorage.h"
#include "projinfo/tasklist.h"
#include "projinfo/texts.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>

#include <limits>

namespace projinfo {
namespace {

const char kModule[] = "CProjInfo";
constexpr int kIdDigits = 6;
constexpr long kOverflow = 6;

/// The user's words for why a file could not be opened, written or moved.
QString reasonFor(const ide::Error& failure) {
  const QString detail = failure.description().section(QStringLiteral(": "), 1);
  switch (failure.number()) {
    case stg::LockViolation:
      return QString::fromUtf16(kInUse).arg(detail.section(QStringLiteral("in use by "), 1));
    case stg::InvalidHeader:
      return QString::fromUtf16(kNotAnInfoFile);
    case stg::DocFileCorrupt:
    case stg::ReadFault:
      return QString::fromUtf16(kDamaged).arg(detail.isEmpty() ? failure.description() : detail);
    case stg::AccessDenied:
      return QString::fromUtf16(kNoAccess);
    case stg::ElementExists:
      return QString::fromUtf16(kExists);
    default:
      return QString::fromUtf16(kOtherFailure).arg(failure.description());
  }
}

ide::Error asError(const std::exception& failure) {
  if (const auto* error = dynamic_cast<const ide::Error*>(&failure)) return *error;
  return ide::Error(ide::err::InvalidProcedureCall, QString::fromLocal8Bit(failure.what()));
}

}  // namespace

// ---------------------------------------------------------------------------------------------------
// Identity

std::optional<QString> IdentityOf(const ide::Ref<ide::VBComponent>& component) {
  if (!component->Name().toUpper().startsWith(QLatin1StringView(kIdentityModulePrefix).toString().toUpper()))
    return std::nullopt;
  auto module = component->CodeModule();
  if (!module) return std::nullopt;
  const QString marker = QLatin1StringView(kIdentityMarker).toString().toUpper();
  const int count = module->CountOfLines();
  for (int line = 1; line <= count; ++line) {
    const QString text = module->Lines(line, 1).trimmed().toUpper();
    if (!text.startsWith(marker)) continue;
    const QString id = text.mid(marker.size(), kIdDigits);
    const bool digits = id.size() == kIdDigits &&
                        std::all_of(id.begin(), id.end(), [](QChar c) { return c >= u'0' && c <= u'9'; });
    if (digits) return id;
  }
  return std::nullopt;
}

std::optional<ProjectIdentity> FindProjectId(const ide::Ref<ide::VBProject>& project) {
  auto components = project->VBComponents();
  for (int i = 1; i <= components->Count(); ++i) {
    auto component = components->Item(i);
    if (auto id = IdentityOf(component)) return ProjectIdentity{component, *id};
  }
  return std::nullopt;
}

QString infoFileTitle(const QString& id) {
  return QStringLiteral("qm") + id + QStringLiteral(".qmi");
}

// ---------------------------------------------------------------------------------------------------

CProjInfo::CProjInfo(ProjInfoServices services) : m_services(std::move(services)) {}

CProjInfo::~CProjInfo() {
  CloseFile();
}

void CProjInfo::ProjectClosed() {
  bool discard = false;
  try {
    const bool projectSaved = !m_project->FileName().isEmpty();
    bool moduleSaved = true;
    if (basProjInfo && !m_tieLost) {
      const QString file = basProjInfo->FileNames(1);
      moduleSaved = !file.isEmpty() && QFileInfo::exists(file);
    }
    discard = m_ownsFile && (!projectSaved || !moduleSaved);
  } catch (const std::exception& failure) {
    common::logFailure(failure, QString::fromLatin1(kModule), QStringLiteral("ProjectClosed"), __LINE__);
  }
  const QString file = path();
  CloseFile();
  if (discard) QFile::remove(file);
  m_ownsFile = false;
}

void CProjInfo::tell(const QString& text, const ide::Error& failure) {
  if (!m_services.tellUser || !m_services.vbe) throw failure;
  m_services.vbe->Platform().ui().MsgBox(text, ide::mb::Exclamation, common::title());
}

bool CProjInfo::Initialize() {
  try {
    std::optional<ProjectIdentity> identity = FindProjectId(m_project);
    if (identity) {
      basProjInfo = identity->module;
      m_id = identity->id;
      FileTitle = infoFileTitle(m_id);
    } else {
      if (!m_services.appInfo) {
        // The user was told at start-up that new projects get no identifier in this session.
        m_unavailable = m_services.appInfoUnavailable;
        return false;
      }
      common::CLockWindowUpdate lock(m_services.vbe->Platform().windows());
      lock.LockWindow(m_services.vbe->MainWindow()->hWnd());
      const QString id = m_services.appInfo->GetNextProjId();
      m_id = id;
      FileTitle = infoFileTitle(id);
      auto module = m_project->VBComponents()->Add(ide::ComponentType::StdModule);
      module->setName(QLatin1StringView(kIdentityModulePrefix) + id);
      module->CodeModule()->InsertLines(1, QLatin1StringView(kIdentityMarker) + id);
      basProjInfo = module;
      try {
        if (auto pane = module->CodeModule()->CodePane()) pane->Window()->Close();
      } catch (const std::exception& failure) {
        // The identity module stays; only its window is left open.
        common::logFailure(failure, QString::fromLatin1(kModule), QStringLiteral("Initialize"), __LINE__);
      }
    }
    m_moduleName = basProjInfo->Name();
    findFilePath();
  } catch (const std::exception& failure) {
    m_unavailable = asError(failure).description();
    throw common::recordError(failure, QString::fromLatin1(kModule), QStringLiteral("Initialize"), __LINE__);
  }
  OpenFile();
  return isOpen();
}

bool CProjInfo::InitializeExisting() {
  std::optional<ProjectIdentity> identity = FindProjectId(m_project);
  if (!identity) return false;
  basProjInfo = identity->module;
  m_id = identity->id;
  m_moduleName = basProjInfo->Name();
  FileTitle = infoFileTitle(m_id);
  findFilePath();
  OpenFile();
  return true;
}

void CProjInfo::findFilePath() {
  const QString fileName = m_project->FileName();
  if (fileName.isEmpty()) {
    FilePath = QDir::tempPath();
  } else {
    Saved = true;
    FilePath = QFileInfo(fileName).absolutePath();
  }
}

void CProjInfo::adoptTemporaryFile() {
  const QString temporary = QDir::temp().filePath(FileTitle);
  if (!Saved || QFileInfo::exists(path()) || QDir(FilePath) == QDir::temp() || !QFileInfo::exists(temporary))
    return;
  try {
    DocFile::open(temporary, DocFile::Access::ReadWrite)->moveTo(path());
  } catch (const std::exception& failure) {
    // Held by another IDE, or damaged: it stays where it is, and the project gets a file of its own.
    common::logFailure(failure, QString::fromLatin1(kModule), QStringLiteral("adoptTemporaryFile"), __LINE__);
  }
}

void CProjInfo::OpenFile() {
  if (m_services.projectHolding) {
    if (const QString other = m_services.projectHolding(*this, path()); !other.isEmpty()) {
      // Opening it would hand one project's tasks to the other, and its writes would replace the first's.
      m_unavailable =
          QString::fromUtf16(kSharedIdentifier)
              .arg(other, m_project->Name(), m_id, m_moduleName, QDir::toNativeSeparators(path()));
      common::logFailure(ide::Error(stg::LockViolation, m_unavailable), QString::fromLatin1(kModule),
                         QStringLiteral("OpenFile"), __LINE__);
      m_ownsFile = false;
      tell(m_unavailable, ide::Error(stg::LockViolation, m_unavailable));
      return;
    }
  }
  adoptTemporaryFile();
  bool isNew = true;
  try {
    m_FileInfo = OpenOrCreateDocFile(path(), isNew, true, false);
    m_TaskList = m_FileInfo->CreateStorage(QStringLiteral("TaskList"), kElementMode);
    m_Favorites = m_FileInfo->CreateStorage(QStringLiteral("Favorites"), kElementMode);
  } catch (const std::exception& failure) {
    release();
    m_ownsFile = false;
    const ide::Error error = asError(failure);
    m_unavailable = QString::fromUtf16(kCannotOpenInfoFile)
                        .arg(m_project->Name(), QDir::toNativeSeparators(path()), reasonFor(error));
    common::recordError(failure, QString::fromLatin1(kModule), QStringLiteral("OpenFile"), __LINE__);
    common::logLastError();
    tell(m_unavailable, error);
    return;
  }
  m_ownsFile = true;
  m_unavailable.clear();
  m_highestTask = highestId(*m_TaskList, kTaskPrefix);
  m_highestFavorite = highestId(*m_Favorites, kFavoritePrefix);
  m_oTaskList = std::make_unique<CTaskList>(*this);
  m_oTaskList->InitializeFromFile();
  if (m_services.createFavorites) {
    m_oFavorites = m_services.createFavorites(*this);
    m_oFavorites->InitializeFromFile();
  }
  // A new file, or storages added to an old one, go to disk now; a folder that cannot take them is told.
  commitChanges();
}

void CProjInfo::release() {
  m_oTaskList.reset();
  m_TaskList.reset();
  m_oFavorites.reset();
  m_Favorites.reset();
  m_FileInfo.reset();
}

void CProjInfo::CloseFile() {
  if (m_FileInfo) {
    try {
      m_FileInfo->Commit(0);
    } catch (const std::exception&) {
      // Told when it first failed; what is only in memory goes with the project.
    }
  }
  release();
}

void CProjInfo::commitChanges() {
  if (!m_FileInfo) return;
  try {
    m_FileInfo->Commit(0);
    m_writeFailed = false;
  } catch (const ide::Error& failure) {
    if (m_writeFailed && m_services.tellUser) return;
    m_writeFailed = true;
    common::recordError(failure, QString::fromLatin1(kModule), QStringLiteral("Commit"), __LINE__);
    common::logLastError();
    tell(QString::fromUtf16(kCannotWriteInfoFile)
             .arg(m_project->Name(), QDir::toNativeSeparators(path()), reasonFor(failure)),
         failure);
  }
}

void CProjInfo::ProjectMoved(const QString& directory) {
  const QString target = QDir(directory).absolutePath();
  if (m_FileInfo && QDir(FilePath) != QDir(target)) {
    const QString from = path();
    try {
      m_FileInfo->StorageInterface().file->moveTo(target + u'/' + FileTitle);
      FilePath = target;
      m_writeFailed = false;
    } catch (const ide::Error& failure) {
      common::recordError(failure, QString::fromLatin1(kModule), QStringLiteral("ProjectMoved"), __LINE__);
      common::logLastError();
      tell(QString::fromUtf16(kCannotMoveInfoFile)
               .arg(m_project->Name(), QDir::toNativeSeparators(from),
                    QDir::toNativeSeparators(target + u'/' + FileTitle), reasonFor(failure)),
           failure);
    }
  } else if (!m_FileInfo) {
    // A file closed when the tie was lost still follows the project, so that it is there if the module
    // comes back.
    if (m_tieLost && QDir(FilePath) != QDir(target) && QFileInfo::exists(path())) {
      try {
        DocFile::open(path(), DocFile::Access::ReadWrite)->moveTo(target + u'/' + FileTitle);
      } catch (const ide::Error& failure) {
        common::recordError(failure, QString::fromLatin1(kModule), QStringLiteral("ProjectMoved"), __LINE__);
        common::logLastError();
        tell(QString::fromUtf16(kCannotMoveInfoFile)
                 .arg(m_project->Name(), QDir::toNativeSeparators(path()),
                      QDir::toNativeSeparators(target + u'/' + FileTitle), reasonFor(failure)),
             failure);
        Saved = true;
        return;
      }
    }
    FilePath = target;
  }
  Saved = true;
}

void CProjInfo::TieLost() {
  if (!m_FileInfo) return;
  CloseFile();
  // Kept whatever becomes of the project: the module may come back.
  m_tieLost = true;
  m_unavailable =
      QString::fromUtf16(kTieLost).arg(m_moduleName, m_project->Name(), QDir::toNativeSeparators(path()));
  if (m_services.tellUser && m_services.vbe)
    m_services.vbe->Platform().ui().MsgBox(m_unavailable, ide::mb::Information, common::title());
}

bool CProjInfo::Retie(const ide::Ref<ide::VBComponent>& component) {
  if (!m_tieLost) return false;
  const std::optional<QString> id = IdentityOf(component);
  if (!id || *id != m_id) return false;
  m_tieLost = false;
  basProjInfo = component;
  m_moduleName = component->Name();
  OpenFile();
  return true;
}

// ---------------------------------------------------------------------------------------------------
// Records

void CProjInfo::writeRecord(Storage& storage, const QString& name, const QString& text) {
  auto stream = storage.CreateStream(name, kElementMode);
  // The record replaces what was there; nothing of a longer old text stays behind it.
  stream->SetSize(0);
  if (stream->WriteData(text) == 0) {
    const common::LastError& last = common::lastError();
    throw ide::Error(last.number, last.description);
  }
}

QString CProjInfo::readRecord(Storage& storage, const QString& name) {
  return storage.CreateStream(name, kElementMode)->ReadData(vbString).toString();
}

void CProjInfo::WriteTaskListItem(const QString& name, const QString& text) {
  if (!m_TaskList) ide::raise(ide::err::ObjectVariableNotSet);
  writeRecord(*m_TaskList, name, text);
  commitChanges();
}

QString CProjInfo::GetTaskListItem(const QString& name) {
  if (!m_TaskList) ide::raise(ide::err::ObjectVariableNotSet);
  return readRecord(*m_TaskList, name);
}

qint32 CProjInfo::GetFavoritesCount() {
  if (!m_Favorites) ide::raise(ide::err::ObjectVariableNotSet);
  return m_Favorites->Elements().Count();
}

void CProjInfo::WriteFavoritesItem(const QString& name, const QString& text) {
  if (!m_Favorites) ide::raise(ide::err::ObjectVariableNotSet);
  writeRecord(*m_Favorites, name, text);
  commitChanges();
}

QString CProjInfo::GetFavoritesItem(const QString& name) {
  if (!m_Favorites) ide::raise(ide::err::ObjectVariableNotSet);
  return readRecord(*m_Favorites, name);
}

qint32 CProjInfo::highestId(Storage& storage, const char* prefix) {
  const QLatin1StringView start(prefix);
  qint32 highest = 0;
  for (const VBSTATSTG& element : storage.Elements()) {
    const QString name = element.Name();
    if (!name.startsWith(start, Qt::CaseInsensitive)) continue;
    bool ok = false;
    const qint32 id = name.mid(start.size()).toInt(&ok);
    if (ok) highest = std::max(highest, id);
  }
  return highest;
}

qint32 CProjInfo::nextId(const char* streamName, qint32& highest) {
  auto stream = m_FileInfo->CreateStream(QLatin1StringView(streamName), kElementMode);
  const qint32 last = stream->ReadData(vbLong).toInt();
  // A record already in the file is never overwritten, whatever the counter says.
  const qint32 current = std::max(last, highest);
  if (current == std::numeric_limits<qint32>::max()) ide::raise(kOverflow);
  stream->SSeek(0);
  stream->WriteData(current + 1);
  highest = current + 1;
  return highest;
}

qint32 CProjInfo::NextTaskId() {
  return nextId("LastTaskId", m_highestTask);
}

qint32 CProjInfo::NextFavoriteId() {
  return nextId("LastFavoriteId", m_highestFavorite);
}

qint32 CProjInfo::addRecord(Storage* storage, InfoRecordList* list, const char* prefix,
                            const std::shared_ptr<InfoRecord>& item, qint32 id) {
  item->ItemId = id;
  const QString key = QLatin1StringView(prefix) + QString::number(id);
  writeRecord(*storage, key, item->Serialization());
  commitChanges();
  if (list) list->insertRecord(key, item);
  return id;
}

qint32 CProjInfo::AddTaskListItem(const std::shared_ptr<InfoRecord>& task) {
  if (!m_TaskList) ide::raise(ide::err::ObjectVariableNotSet);
  return addRecord(m_TaskList.get(), m_oTaskList.get(), kTaskPrefix, task, NextTaskId());
}

qint32 CProjInfo::AddFavoritesItem(const std::shared_ptr<InfoRecord>& item) {
  if (!m_Favorites) ide::raise(ide::err::ObjectVariableNotSet);
  return addRecord(m_Favorites.get(), m_oFavorites.get(), kFavoritePrefix, item, NextFavoriteId());
}

void CProjInfo::deleteRecord(Storage* storage, InfoRecordList* list, const char* prefix, qint32 id) {
  if (!storage) ide::raise(ide::err::ObjectVariableNotSet);
  const QString key = QLatin1StringView(prefix) + QString::number(id);
  storage->DestroyElement(key);
  if (list) list->removeRecord(key);
  commitChanges();
}

void CProjInfo::DeleteTask(qint32 id) {
  deleteRecord(m_TaskList.get(), m_oTaskList.get(), kTaskPrefix, id);
}

void CProjInfo::DeleteFavorite(qint32 id) {
  deleteRecord(m_Favorites.get(), m_oFavorites.get(), kFavoritePrefix, id);
}

}  // namespace projinfo
