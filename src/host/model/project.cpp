// SPDX-License-Identifier: MIT
// Projects: their project file, their components and what they write back.
#include "fileio/fileio.h"
#include "fileio/parallel.h"
#include "host/files/modulefile.h"
#include "host/model/objects.h"
#include "host/model/vbe.h"

#include <QDir>
#include <QFileInfo>

namespace host {

using namespace fileio;
namespace {

ide::ComponentType typeOfEntry(ComponentKind kind) {
  switch (kind) {
    case ComponentKind::Module:
      return ide::ComponentType::StdModule;
    case ComponentKind::Class:
      return ide::ComponentType::ClassModule;
    case ComponentKind::Form:
      return ide::ComponentType::VBForm;
    case ComponentKind::UserControl:
      return ide::ComponentType::UserControl;
    case ComponentKind::PropertyPage:
      return ide::ComponentType::PropPage;
    case ComponentKind::UserDocument:
      return ide::ComponentType::DocObject;
    case ComponentKind::Designer:
      return ide::ComponentType::ActiveXDesigner;
    case ComponentKind::RelatedDocument:
      return ide::ComponentType::RelatedDocument;
    case ComponentKind::ResourceFile:
      return ide::ComponentType::ResFile;
  }
  return ide::ComponentType::RelatedDocument;
}

ComponentKind entryKindOf(ide::ComponentType type) {
  switch (type) {
    case ide::ComponentType::StdModule:
      return ComponentKind::Module;
    case ide::ComponentType::ClassModule:
      return ComponentKind::Class;
    case ide::ComponentType::VBForm:
    case ide::ComponentType::VBMDIForm:
      return ComponentKind::Form;
    case ide::ComponentType::UserControl:
      return ComponentKind::UserControl;
    case ide::ComponentType::PropPage:
      return ComponentKind::PropertyPage;
    case ide::ComponentType::DocObject:
      return ComponentKind::UserDocument;
    case ide::ComponentType::ActiveXDesigner:
    case ide::ComponentType::MSForm:
      return ComponentKind::Designer;
    case ide::ComponentType::ResFile:
      return ComponentKind::ResourceFile;
    case ide::ComponentType::RelatedDocument:
      return ComponentKind::RelatedDocument;
  }
  return ComponentKind::RelatedDocument;
}

ide::ComponentType typeOfFile(const QString& path) {
  const QString suffix = QFileInfo(path).suffix().toLower();
  if (suffix == QLatin1StringView("bas")) return ide::ComponentType::StdModule;
  if (suffix == QLatin1StringView("cls")) return ide::ComponentType::ClassModule;
  if (suffix == QLatin1StringView("frm")) return ide::ComponentType::VBForm;
  if (suffix == QLatin1StringView("ctl")) return ide::ComponentType::UserControl;
  if (suffix == QLatin1StringView("pag")) return ide::ComponentType::PropPage;
  if (suffix == QLatin1StringView("dob")) return ide::ComponentType::DocObject;
  if (suffix == QLatin1StringView("dsr")) return ide::ComponentType::ActiveXDesigner;
  if (suffix == QLatin1StringView("res")) return ide::ComponentType::ResFile;
  return ide::ComponentType::RelatedDocument;
}

QString fileSuffixOf(ide::ComponentType type) {
  switch (type) {
    case ide::ComponentType::ClassModule:
      return QStringLiteral("cls");
    case ide::ComponentType::VBForm:
    case ide::ComponentType::VBMDIForm:
      return QStringLiteral("frm");
    case ide::ComponentType::UserControl:
      return QStringLiteral("ctl");
    case ide::ComponentType::PropPage:
      return QStringLiteral("pag");
    case ide::ComponentType::DocObject:
      return QStringLiteral("dob");
    case ide::ComponentType::ActiveXDesigner:
      return QStringLiteral("dsr");
    default:
      return QStringLiteral("bas");
  }
}

ide::ProjectType projectTypeOf(const QString& value) {
  if (value.compare(QLatin1StringView("OleDll"), Qt::CaseInsensitive) == 0)
    return ide::ProjectType::ActiveXDll;
  if (value.compare(QLatin1StringView("OleExe"), Qt::CaseInsensitive) == 0)
    return ide::ProjectType::ActiveXExe;
  if (value.compare(QLatin1StringView("Control"), Qt::CaseInsensitive) == 0)
    return ide::ProjectType::ActiveXControl;
  return ide::ProjectType::StandardExe;
}

QString projectTypeText(ide::ProjectType type) {
  switch (type) {
    case ide::ProjectType::ActiveXDll:
      return QStringLiteral("OleDll");
    case ide::ProjectType::ActiveXExe:
      return QStringLiteral("OleExe");
    case ide::ProjectType::ActiveXControl:
      return QStringLiteral("Control");
    default:
      return QStringLiteral("Exe");
  }
}

bool isIdentifier(const QString& name) {
  if (name.isEmpty() || name.size() > 40 || !name.front().isLetter()) return false;
  for (const QChar c : name)
    if (!c.isLetterOrNumber() && c != u'_') return false;
  return true;
}

/// The 1-based line of each component entry of a project file, in the order of its components().
std::vector<int> componentEntryLines(const ProjectFile& file) {
  std::vector<int> lines;
  static const ComponentKind kKinds[] = {
      ComponentKind::Module,      ComponentKind::Class,           ComponentKind::Form,
      ComponentKind::UserControl, ComponentKind::PropertyPage,    ComponentKind::UserDocument,
      ComponentKind::Designer,    ComponentKind::RelatedDocument, ComponentKind::ResourceFile};
  const auto& all = file.write();
  for (size_t i = 0; i < all.size(); ++i) {
    const QString& text = all[i].text;
    if (text.startsWith(u'[')) break;  // the sections follow the main part
    const qsizetype equals = text.indexOf(u'=');
    if (equals <= 0) continue;
    const QStringView key = QStringView(text).first(equals).trimmed();
    for (const ComponentKind kind : kKinds)
      if (key.compare(componentKey(kind), Qt::CaseInsensitive) == 0) lines.push_back(static_cast<int>(i) + 1);
  }
  return lines;
}

class ReferenceImpl final : public ide::Reference {
 public:
  explicit ReferenceImpl(const QString& raw) {
    // "*\G{guid}#version#lcid#path#description" for type libraries, "*\A<path>" for projects.
    if (raw.startsWith(QLatin1StringView("*\\A"))) {
      m_path = raw.sliced(3);
      m_name = QFileInfo(QString(m_path).replace(u'\\', u'/')).completeBaseName();
      return;
    }
    const QStringList parts = raw.sliced(raw.startsWith(QLatin1StringView("*\\G")) ? 3 : 0).split(u'#');
    m_guid = parts.value(0);
    m_path = parts.value(3);
    m_description = parts.value(4);
    m_name = QFileInfo(QString(m_path).replace(u'\\', u'/')).completeBaseName();
  }
  QString Name() override { return m_name; }
  QString Guid() override { return m_guid; }
  QString FullPath() override { return m_path; }
  QString Description() override { return m_description; }

 private:
  QString m_name, m_guid, m_path, m_description;
};

class ReferencesImpl final : public ide::References {
 public:
  explicit ReferencesImpl(const QStringList& raw) {
    for (const QString& reference : raw)
      m_items.push_back(std::make_shared<ReferenceImpl>(reference));
  }
  int Count() override { return static_cast<int>(m_items.size()); }
  ide::Ref<ide::Reference> Item(int index) override {
    if (index < 1 || index > Count()) ide::raise(ide::err::SubscriptOutOfRange);
    return m_items[static_cast<size_t>(index - 1)];
  }

 private:
  std::vector<ide::Ref<ide::Reference>> m_items;
};

}  // namespace

ProjectImpl::ProjectImpl(const std::shared_ptr<VbeImpl>& vbe)
    : componentEvents(std::make_shared<ide::ComponentsEventSource>()),
      referenceEvents(std::make_shared<ide::ReferencesEventSource>()),
      fileEvents(std::make_shared<ide::FileControlEventSource>()),
      controlEvents(std::make_shared<ide::ControlsEventSource>()),
      selectedControlEvents(std::make_shared<ide::SelectedControlsEventSource>()),
      m_vbe(vbe) {}

ProjectImpl::~ProjectImpl() = default;

QString ProjectImpl::directory() const {
  return m_fileName.isEmpty() ? QString() : QFileInfo(m_fileName).absolutePath();
}

void ProjectImpl::load(const QString& fileName) {
  m_fileName = fileName;
  FileStamp stamp;
  m_file = ProjectFile::parse(readFileBytes(fileName, &stamp), fileName);
  m_stamp = std::move(stamp);
  m_name = m_file->name();
  if (m_name.isEmpty()) m_name = QFileInfo(fileName).completeBaseName();
  m_type = projectTypeOf(m_file->value(u"Type").value_or(QString()).trimmed());
  const QString dir = directory();
  const auto entries = m_file->components();
  const auto entryLines = componentEntryLines(*m_file);
  auto self = shared_from_this();
  std::vector<std::shared_ptr<ComponentImpl>> loaded;
  for (const ProjectComponent& entry : entries)
    loaded.push_back(
        std::make_shared<ComponentImpl>(self, typeOfEntry(entry.kind), resolveProjectPath(dir, entry.path)));
  // Each component reads and indexes its own file: they are read side by side.
  std::vector<std::exception_ptr> failures;
  parallelFor(
      loaded.size(), [&](size_t i) { loaded[i]->load(); }, failures);
  for (size_t i = 0; i < loaded.size(); ++i) {
    const int line = i < entryLines.size() ? entryLines[i] : 0;
    if (failures[i]) {
      try {
        std::rethrow_exception(failures[i]);
      } catch (const ide::Error& error) {
        // The rest of the project loads without a missing file, as in the IDE; its entry stays.
        if (error.number() == ide::err::FileNotFound) {
          m_missing.push_back({fileName, line, entries[i].path});
          m_entryMissing.push_back(true);
          continue;
        }
        if (error.number() == ide::err::PathFileAccessError)
          ide::raise(error.number(),
                     QStringLiteral("%1, line %2: %3").arg(fileName).arg(line).arg(error.description()));
        throw;
      }
    }
    if (this->component(loaded[i]->Name()))
      ide::raise(ide::err::NameConflict, QStringLiteral("%1, line %2: %3 is the name of another component")
                                             .arg(fileName)
                                             .arg(line)
                                             .arg(loaded[i]->Name()));
    m_components.push_back(loaded[i]);
    m_entryMissing.push_back(false);
  }
  m_changed = false;
}

void ProjectImpl::create(ide::ProjectType type, const QString& name) {
  m_type = type;
  m_name = name;
  const QString text =
      QStringLiteral(
          "Type=%1\r\nReference=*\\G{00020430-0000-0000-C000-000000000046}#2.0#0#..\\..\\..\\Windows\\"
          "System32\\stdole2.tlb#OLE Automation\r\nStartup=\"(None)\"\r\nName=\"%2\"\r\n"
          "HelpContextID=\"0\"\r\nCompatibleMode=\"0\"\r\nMajorVer=1\r\nMinorVer=0\r\nRevisionVer=0\r\n"
          "AutoIncrementVer=0\r\n")
          .arg(projectTypeText(type), name);
  m_file = ProjectFile::parse(text.toLatin1(), name);
  m_changed = true;
}

QString ProjectImpl::Description() {
  const QString raw = m_file ? m_file->value(u"Description").value_or(QString()) : QString();
  return unquoteVbString(raw.trimmed()).value_or(raw);
}

ide::Ref<ide::VBComponents> ProjectImpl::VBComponents() {
  return shared_from_this();
}

ide::Ref<ide::References> ProjectImpl::References() {
  return std::make_shared<ReferencesImpl>(m_file ? m_file->references() : QStringList());
}

ide::Ref<ide::VBProjects> ProjectImpl::Collection() {
  auto vbe = m_vbe.lock();
  if (!vbe || m_detached) ide::raise(ide::err::ObjectVariableNotSet);
  return vbe->VBProjects();
}

bool ProjectImpl::Saved() {
  if (m_changed || m_fileName.isEmpty()) return false;
  for (const auto& component : m_components)
    if (component->IsDirty()) return false;
  return true;
}

void ProjectImpl::setName(const QString& name) {
  if (name == m_name) return;
  if (!isIdentifier(name)) ide::raise(ide::err::InvalidName);
  auto vbe = m_vbe.lock();
  if (vbe) {
    auto other = vbe->project(name);
    if (other && other.get() != this) ide::raise(ide::err::NameConflict);
  }
  if (component(name)) ide::raise(ide::err::NameConflict);
  const QString oldName = m_name;
  m_name = name;
  m_file->setName(name);
  m_changed = true;
  if (vbe) vbe->fireProjectRenamed(shared_from_this(), oldName);
}

ide::Ref<ide::VBComponent> ProjectImpl::Item(int index) {
  if (index < 1 || index > Count()) ide::raise(ide::err::SubscriptOutOfRange);
  return m_components[static_cast<size_t>(index - 1)];
}

ide::Ref<ide::VBComponent> ProjectImpl::Item(const QString& name) {
  if (auto found = component(name)) return found;
  ide::raise(ide::err::SubscriptOutOfRange);
}

std::shared_ptr<ComponentImpl> ProjectImpl::component(const QString& name) const {
  for (const auto& component : m_components)
    if (component->Name().compare(name, Qt::CaseInsensitive) == 0) return component;
  return nullptr;
}

QString ProjectImpl::freeComponentName(const QString& prefix) const {
  for (int n = 1;; ++n) {
    const QString name = prefix + QString::number(n);
    if (!component(name) && name.compare(m_name, Qt::CaseInsensitive) != 0) return name;
  }
}

void ProjectImpl::checkComponentName(const QString& name, const ComponentImpl* except) const {
  if (!isIdentifier(name)) ide::raise(ide::err::InvalidName);
  auto other = component(name);
  if ((other && other.get() != except) || name.compare(m_name, Qt::CaseInsensitive) == 0)
    ide::raise(ide::err::NameConflict);
}

int ProjectImpl::indexOf(const ComponentImpl& component) const {
  for (size_t i = 0; i < m_components.size(); ++i)
    if (m_components[i].get() == &component) return static_cast<int>(i);
  return -1;
}

int ProjectImpl::entryIndexOf(int index) const {
  int entry = 0;
  for (int loaded = -1; entry < static_cast<int>(m_entryMissing.size()); ++entry)
    if (!m_entryMissing[static_cast<size_t>(entry)] && ++loaded == index) return entry;
  return entry;  // past the entries: only for a component that has none, which cannot happen
}

QString ProjectImpl::componentEntryPath(const ComponentImpl& component) const {
  const QString dir = directory();
  if (component.filePath().isEmpty()) return {};
  return dir.isEmpty() ? component.filePath() : projectRelativePath(dir, component.filePath());
}

void ProjectImpl::componentEntryChanged(ComponentImpl& component, const QString& /*oldName*/) {
  const int found = indexOf(component);
  if (found < 0) return;
  const int index = entryIndexOf(found);
  const ProjectComponent entry = m_file->components()[static_cast<size_t>(index)];
  if ((entry.kind == ComponentKind::Module || entry.kind == ComponentKind::Class) &&
      entry.name != component.Name()) {
    m_file->setComponentName(index, component.Name());
    m_changed = true;
  }
  // An entry keeps its spelling (backslashes, ".\", a letter case the disk does not have) for as long as
  // it names the component's file: the project is rewritten only when a file really moved.
  const QString path = componentEntryPath(component);
  if (!path.isEmpty() && entry.path != path &&
      resolveProjectPath(directory(), entry.path) != QDir::cleanPath(component.filePath())) {
    m_file->setComponentPath(index, path);
    m_changed = true;
  }
}

void ProjectImpl::addComponentEntry(ComponentImpl& component) {
  ProjectComponent entry;
  entry.kind = entryKindOf(component.Type());
  if (entry.kind == ComponentKind::Module || entry.kind == ComponentKind::Class)
    entry.name = component.Name();
  entry.path = componentEntryPath(component);
  if (entry.path.isEmpty()) entry.path = component.Name() + u'.' + fileSuffixOf(component.Type());
  m_file->addComponent(entry);
  m_entryMissing.push_back(false);  // the new entry follows the other component entries
  m_changed = true;
}

ide::Ref<ide::VBComponent> ProjectImpl::Add(ide::ComponentType type) {
  if (m_detached) ide::raise(ide::err::ObjectVariableNotSet);
  switch (type) {
    case ide::ComponentType::StdModule:
    case ide::ComponentType::ClassModule:
    case ide::ComponentType::VBForm:
    case ide::ComponentType::VBMDIForm:
      break;
    default:
      ide::raise(ide::err::InvalidProcedureCall);
  }
  auto component = std::make_shared<ComponentImpl>(shared_from_this(), type, QString());
  component->create(freeComponentName(componentTypeName(type)));
  m_components.push_back(component);
  addComponentEntry(*component);
  if (auto vbe = m_vbe.lock()) vbe->fireComponentAdded(component);
  return component;
}

ide::Ref<ide::VBComponent> ProjectImpl::AddFile(const QString& fileName) {
  const QString path =
      QFileInfo(fileName).isAbsolute() ? fileName : QDir(directory()).absoluteFilePath(fileName);
  return addExistingFile(QFileInfo(path).absoluteFilePath(), true);
}

std::shared_ptr<ComponentImpl> ProjectImpl::addExistingFile(const QString& path, bool announce,
                                                            const QByteArray* contents) {
  if (m_detached) ide::raise(ide::err::ObjectVariableNotSet);
  for (const auto& existing : m_components)
    if (QFileInfo(existing->filePath()) == QFileInfo(path))
      ide::raise(ide::err::NameConflict, QStringLiteral("%1 is in the project already").arg(path));
  auto component = std::make_shared<ComponentImpl>(shared_from_this(), typeOfFile(path), path);
  component->load(contents);
  if (this->component(component->Name()))
    ide::raise(ide::err::NameConflict,
               QStringLiteral("%1: %2 is the name of another component").arg(path, component->Name()));
  m_components.push_back(component);
  addComponentEntry(*component);
  if (announce) {
    if (auto vbe = m_vbe.lock()) {
      vbe->fireFileAdded(shared_from_this(), fileTypeOf(component->Type()), path);
      vbe->fireComponentAdded(component);
    }
  }
  return component;
}

void ProjectImpl::Remove(const ide::Ref<ide::VBComponent>& component) {
  auto impl = std::dynamic_pointer_cast<ComponentImpl>(component);
  const int index = impl ? indexOf(*impl) : -1;
  if (index < 0) ide::raise(ide::err::InvalidProcedureCall);
  if (auto vbe = m_vbe.lock()) vbe->fireComponentRemoved(impl);
  // A handler may have removed it meanwhile.
  const int now = indexOf(*impl);
  if (now < 0) return;
  impl->closeWindows();
  const int entry = entryIndexOf(now);
  m_file->removeComponent(entry);
  m_entryMissing.erase(m_entryMissing.begin() + entry);
  m_components.erase(m_components.begin() + now);
  impl->detach();
  m_changed = true;
  if (!impl->filePath().isEmpty())
    if (auto vbe = m_vbe.lock())
      vbe->fireFileRemoved(shared_from_this(), fileTypeOf(impl->Type()), impl->filePath());
}

void ProjectImpl::assignFilePaths(const QString& dir) {
  for (const auto& component : m_components) {
    if (!component->filePath().isEmpty() || !component->hasCode()) continue;
    // A new component gets its name as file name, unless a file of that name is there already.
    const QString suffix = fileSuffixOf(component->Type());
    QString path = QDir(dir).absoluteFilePath(component->Name() + u'.' + suffix);
    for (int n = 2; QFileInfo::exists(path); ++n)
      path = QDir(dir).absoluteFilePath(QStringLiteral("%1%2.%3").arg(component->Name()).arg(n).arg(suffix));
    component->setFilePath(path);
  }
}

void ProjectImpl::save() {
  SaveBatch batch;
  addToBatch(batch);
  batch.commit();
}

void ProjectImpl::addToBatch(SaveBatch& batch) {
  if (m_fileName.isEmpty()) {
    // A project opened from a lone module file has nothing to write but its components.
    for (const auto& component : m_components)
      if (component->filePath().isEmpty() && component->IsDirty()) ide::raise(ide::err::BadFileNameOrNumber);
    host::addToBatch(batch, m_components);
    return;
  }
  assignFilePaths(directory());
  host::addToBatch(batch, m_components);
  for (const auto& component : m_components)
    componentEntryChanged(*component, component->Name());
  if (!m_changed) return;
  batch.add({m_fileName, m_file->toBytes(m_fileName), stampFor(m_stamp, m_fileName)},
            [self = shared_from_this(), path = m_fileName](const FileStamp* written) {
              if (written) {
                self->m_changed = false;
                self->m_stamp = *written;
              }
              if (auto vbe = self->m_vbe.lock())
                vbe->fireFileWritten(self, ide::FileType::Project, path, written ? 0 : 2);
            });
}

void ProjectImpl::SaveAs(const QString& fileName) {
  if (m_detached) ide::raise(ide::err::ObjectVariableNotSet);
  const QString target = QFileInfo(fileName).absoluteFilePath();
  const QString oldName = m_fileName;
  const ProjectFile oldFile = *m_file;
  m_fileName = target;
  try {
    // Components stay where they are; the new project file refers to them from its own folder.
    m_changed = true;
    save();
  } catch (...) {
    m_fileName = oldName;
    *m_file = oldFile;
    m_changed = true;
    throw;
  }
  if (oldName != target)
    if (auto vbe = m_vbe.lock())
      vbe->fireFileNameChanged(shared_from_this(), ide::FileType::Project, target, oldName);
}

void ProjectImpl::acceptFilesOnDisk(const QStringList& paths) {
  restampIfListed(m_stamp, paths);
  for (const auto& component : m_components)
    component->acceptFileOnDisk(paths);
}

void ProjectImpl::detach() {
  m_detached = true;
  for (const auto& component : m_components)
    component->detach();
}

}  // namespace host
