// SPDX-License-Identifier: MIT
// Components: their files, names, code modules, designers and windows.
#include "fileio/fileio.h"
#include "fileio/parallel.h"
#include "host/files/ansi.h"
#include "host/files/frxfile.h"
#include "host/model/designer.h"
#include "host/model/events.h"
#include "host/model/objects.h"
#include "host/model/vbe.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>

namespace host {

using namespace fileio;
namespace {

bool hasModuleText(ide::ComponentType type) {
  return type != ide::ComponentType::ResFile && type != ide::ComponentType::RelatedDocument;
}

/// The text of a new component, as the IDE writes a fresh one.
QString newComponentText(ide::ComponentType type, const QString& name) {
  switch (type) {
    case ide::ComponentType::ClassModule:
      return QStringLiteral(
                 "VERSION 1.0 CLASS\r\nBEGIN\r\n  MultiUse = -1  'True\r\n  Persistable = 0  "
                 "'NotPersistable\r\n"
                 "  DataBindingBehavior = 0  'vbNone\r\n  DataSourceBehavior  = 0  'vbNone\r\n"
                 "  MTSTransactionMode  = 0  'NotAnMTSObject\r\nEND\r\nAttribute VB_Name = \"%1\"\r\n"
                 "Attribute VB_GlobalNameSpace = False\r\nAttribute VB_Creatable = True\r\n"
                 "Attribute VB_PredeclaredId = False\r\nAttribute VB_Exposed = False\r\n")
          .arg(name);
    case ide::ComponentType::VBForm:
    case ide::ComponentType::VBMDIForm: {
      const bool mdi = type == ide::ComponentType::VBMDIForm;
      return QStringLiteral(
                 "VERSION 5.00\r\nBegin VB.%2 %1 \r\n   Caption         =   \"%1\"\r\n   ClientHeight    =   "
                 "3090\r\n"
                 "   ClientLeft      =   60\r\n   ClientTop       =   450\r\n   ClientWidth     =   4680\r\n"
                 "   LinkTopic       =   \"%1\"\r\n   ScaleHeight     =   3090\r\n   ScaleWidth      =   "
                 "4680\r\n"
                 "   StartUpPosition =   3  'Windows Default\r\nEnd\r\nAttribute VB_Name = \"%1\"\r\n"
                 "Attribute VB_GlobalNameSpace = False\r\nAttribute VB_Creatable = False\r\n"
                 "Attribute VB_PredeclaredId = True\r\nAttribute VB_Exposed = False\r\n")
          .arg(name, mdi ? QStringLiteral("MDIForm") : QStringLiteral("Form"));
    }
    default:
      return QStringLiteral("Attribute VB_Name = \"%1\"\r\n").arg(name);
  }
}

}  // namespace

QString componentTypeName(ide::ComponentType type) {
  switch (type) {
    case ide::ComponentType::StdModule:
      return QStringLiteral("Module");
    case ide::ComponentType::ClassModule:
      return QStringLiteral("Class");
    case ide::ComponentType::VBForm:
      return QStringLiteral("Form");
    case ide::ComponentType::VBMDIForm:
      return QStringLiteral("MDIForm");
    case ide::ComponentType::UserControl:
      return QStringLiteral("UserControl");
    case ide::ComponentType::PropPage:
      return QStringLiteral("PropertyPage");
    case ide::ComponentType::DocObject:
      return QStringLiteral("UserDocument");
    case ide::ComponentType::ActiveXDesigner:
    case ide::ComponentType::MSForm:
      return QStringLiteral("Designer");
    case ide::ComponentType::ResFile:
      return QStringLiteral("ResFile");
    case ide::ComponentType::RelatedDocument:
      return QStringLiteral("RelatedDocument");
  }
  return QStringLiteral("Component");
}

SaveBatch::SaveBatch() : files(std::make_unique<FileWriteBatch>()) {}
SaveBatch::~SaveBatch() = default;

void SaveBatch::add(FileWriteBatch::File file, Done finish) {
  files->add(std::move(file));
  done.push_back(std::move(finish));
}

void SaveBatch::addAll(std::vector<FileWriteBatch::File> batchFiles, std::vector<Done> finish) {
  files->addAll(std::move(batchFiles));
  for (Done& each : finish)
    done.push_back(std::move(each));
}

void SaveBatch::commit() {
  const auto finish = [&] {
    for (size_t i = 0; i < done.size(); ++i)
      done[i](files->written(i));
  };
  try {
    files->commit();
  } catch (...) {
    finish();
    throw;
  }
  finish();
}

std::optional<FileStamp> stampFor(const std::optional<FileStamp>& stamp, const QString& path) {
  if (stamp && stamp->path == path) return stamp;
  return std::nullopt;
}

void restampIfListed(std::optional<FileStamp>& stamp, const QStringList& paths) {
  if (stamp && paths.contains(stamp->path)) stamp = FileStamp::of(stamp->path);
}

ide::FileType fileTypeOf(ide::ComponentType type) {
  switch (type) {
    case ide::ComponentType::VBForm:
    case ide::ComponentType::VBMDIForm:
      return ide::FileType::Form;
    case ide::ComponentType::ClassModule:
      return ide::FileType::Class;
    case ide::ComponentType::UserControl:
      return ide::FileType::UserControl;
    case ide::ComponentType::PropPage:
      return ide::FileType::PropertyPage;
    case ide::ComponentType::DocObject:
      return ide::FileType::DocObject;
    case ide::ComponentType::ResFile:
      return ide::FileType::Res;
    case ide::ComponentType::ActiveXDesigner:
    case ide::ComponentType::MSForm:
      return ide::FileType::Designers;
    case ide::ComponentType::RelatedDocument:
      return ide::FileType::Binary;
    default:
      return ide::FileType::Module;
  }
}

ComponentImpl::ComponentImpl(const std::shared_ptr<ProjectImpl>& project, ide::ComponentType type,
                             QString filePath)
    : m_project(project), m_type(type), m_filePath(std::move(filePath)) {}

ComponentImpl::~ComponentImpl() = default;

void ComponentImpl::load(const QByteArray* contents) {
  if (!hasModuleText(m_type)) {
    if (!QFileInfo::exists(m_filePath))
      ide::raise(ide::err::FileNotFound, QStringLiteral("File not found: %1").arg(m_filePath));
    m_name = QFileInfo(m_filePath).fileName();
    return;
  }
  std::optional<FileStamp> stamp;
  const QByteArray bytes = contents ? *contents : readFileBytes(m_filePath, &stamp.emplace());
  m_looksLikeUtf8 = sourceEncoding() == SourceEncoding::Ansi && host::looksLikeUtf8(bytes);
  adopt(bytes, m_filePath);
  m_stamp = std::move(stamp);
  if (m_name.isEmpty()) m_name = QFileInfo(m_filePath).completeBaseName();
  loadBinary();
  m_changed = false;
}

namespace {

/// `name` in `directory`, in the letter case the disk has when only that differs.
QString pathInDirectory(const QString& directory, const QString& name) {
  const QDir dir(directory);
  if (dir.exists(name)) return dir.filePath(name);
  for (const QString& entry : dir.entryList(QDir::Files | QDir::Hidden))
    if (entry.compare(name, Qt::CaseInsensitive) == 0) return dir.filePath(entry);
  return dir.filePath(name);
}

}  // namespace

void ComponentImpl::loadBinary() {
  if (!m_form || m_filePath.isEmpty()) return;
  if (frxProperties(m_form->description().root()).empty()) return;
  const QString path = binaryWritePath();
  if (!QFileInfo::exists(path)) return;
  FileStamp stamp;
  m_form->setBinary(FrxFile(readFileBytes(path, &stamp)));
  m_binaryStamp = std::move(stamp);
}

QString ComponentImpl::binaryFileName() {
  if (!m_source.form) return {};
  for (const FrxProperty& property : frxProperties(m_source.form->root()))
    return property.reference.fileName;
  const QString path = binaryFilePath();
  if (!path.isEmpty()) return QFileInfo(path).fileName();
  static const std::pair<ide::ComponentType, const char*> kSuffixes[] = {
      {ide::ComponentType::UserControl, "ctx"},
      {ide::ComponentType::PropPage, "pgx"},
      {ide::ComponentType::DocObject, "dox"}};
  for (const auto& [type, suffix] : kSuffixes)
    if (type == m_type) return m_name + u'.' + QLatin1StringView(suffix);
  return m_name + QStringLiteral(".frx");
}

QString ComponentImpl::binaryWritePath() {
  return pathInDirectory(QFileInfo(m_filePath).absolutePath(), binaryFileName());
}

void ComponentImpl::addBinaryToBatch(SaveBatch& batch) {
  if (!m_form || !m_form->binaryChanged()) return;
  const QString path = binaryWritePath();
  // What is being written is the file as it is now: a change made meanwhile is written next time.
  const QByteArray written = m_form->binary().bytes();
  batch.add({path, written, stampFor(m_binaryStamp, path)},
            [self = shared_from_this(), written](const FileStamp* stamp) {
              if (!stamp) return;
              self->m_binaryStamp = *stamp;
              if (self->m_form->binary().bytes() == written) self->m_form->binarySaved();
            });
}

void ComponentImpl::create(const QString& name) {
  const auto bytes = encodeAnsi(newComponentText(m_type, name));
  if (!bytes) ide::raise(ide::err::InvalidName);
  adopt(*bytes, name);
  m_changed = true;
}

void ComponentImpl::adopt(const QByteArray& bytes, const QString& fileName) {
  ModuleHead head = parseModuleHead(bytes, fileName);
  m_source = std::move(head.source);
  m_name = moduleName(m_source);
  if (m_source.form &&
      m_source.form->root().className().compare(QLatin1StringView("VB.MDIForm"), Qt::CaseInsensitive) == 0)
    m_type = ide::ComponentType::VBMDIForm;
  auto self = shared_from_this();
  m_module = std::make_shared<CodeModuleImpl>(self);
  const QByteArrayView code = QByteArrayView(bytes).sliced(head.codeOffset);
  auto project = m_project.lock();
  auto vbe = project ? project->vbe() : nullptr;
  if (vbe && vbe->readsCodeOnDemand()) {
    // What would make reading the lines fail is refused now, while the file is being opened.
    checkSourceLines(code, fileName, head.codeLine);
    m_module->loadLater({bytes, head.codeOffset, head.codeLine, fileName});
  } else {
    ModuleSource parts;
    parseModuleCode(code, fileName, head.codeLine, parts);
    m_module->load(std::move(parts.code), std::move(parts.memberAttributes));
  }
  m_savedChangeCount = m_module->changeCount();
  if (m_source.form) m_form = std::make_shared<FormImpl>(self, *m_source.form);
}

void ComponentImpl::save(bool force) {
  SaveBatch batch;
  addToBatch(batch, force);
  batch.commit();
}

std::optional<QByteArray> ComponentImpl::fileContents(bool force) {
  if (!m_module) return std::nullopt;  // binary documents are never written
  if (!force && !IsDirty()) return std::nullopt;
  if (m_filePath.isEmpty()) ide::raise(ide::err::BadFileNameOrNumber);
  struct CodeParts {
    ModuleSource& source;
    ~CodeParts() {
      source.code.clear();
      source.memberAttributes.clear();
    }
  } parts{m_source};
  m_module->text().store(m_source.code, m_source.memberAttributes);
  return writeModule(m_source, m_filePath);
}

void ComponentImpl::addToBatch(SaveBatch& batch, bool force) {
  if (auto contents = fileContents(force)) batch.add({m_filePath, *contents, fileStamp()}, whenWritten());
  addBinaryToBatch(batch);
}

SaveBatch::Done ComponentImpl::whenWritten() {
  // What is being written is the module as it is now.
  const quint64 savedChangeCount = m_module->changeCount();
  return [self = shared_from_this(), savedChangeCount, path = m_filePath](const FileStamp* written) {
    if (written) {
      self->m_savedChangeCount = savedChangeCount;
      self->m_changed = false;
      self->m_stamp = *written;
    }
    auto project = self->project();
    if (auto vbe = project ? project->vbe() : nullptr)
      vbe->fireFileWritten(project, fileTypeOf(self->m_type), path, written ? 0 : 2);
  };
}

void addToBatch(SaveBatch& batch, const std::vector<std::shared_ptr<ComponentImpl>>& components, bool force) {
  // Each file is put together from its own component alone: on every core.
  std::vector<std::optional<QByteArray>> contents(components.size());
  std::vector<std::exception_ptr> failures;
  parallelFor(
      components.size(), [&](size_t i) { contents[i] = components[i]->fileContents(force); }, failures);
  for (const std::exception_ptr& failure : failures)
    if (failure) std::rethrow_exception(failure);
  std::vector<FileWriteBatch::File> files;
  std::vector<SaveBatch::Done> done;
  for (size_t i = 0; i < components.size(); ++i) {
    if (!contents[i]) continue;
    files.push_back({components[i]->filePath(), std::move(*contents[i]), components[i]->fileStamp()});
    done.push_back(components[i]->whenWritten());
  }
  batch.addAll(std::move(files), std::move(done));
  for (const auto& component : components)
    component->addBinaryToBatch(batch);
}

bool ComponentImpl::IsDirty() {
  if (m_changed) return true;
  return m_module && m_module->changeCount() != m_savedChangeCount;
}

void ComponentImpl::unloadCode(const QByteArray* contents) {
  if (!m_module || !m_module->isLoaded() || m_module->hasPane() || m_filePath.isEmpty()) return;
  if (m_module->unload()) return;
  QByteArray bytes;
  ModuleHead head;
  try {
    bytes = contents ? *contents : *fileContents(true);
    head = parseModuleHead(bytes, m_filePath);
    checkSourceLines(QByteArrayView(bytes).sliced(head.codeOffset), m_filePath, head.codeLine);
  } catch (const ide::Error&) {
    return;  // kept as lines: they cannot be written, or not read back
  }
  m_module->unload(CodeModuleImpl::Unread{std::move(bytes), head.codeOffset, head.codeLine, m_filePath});
}

void ComponentImpl::setName(const QString& name) {
  auto project = m_project.lock();
  if (!project) ide::raise(ide::err::ObjectVariableNotSet);
  if (name == m_name) return;
  project->checkComponentName(name, this);
  const QString oldName = m_name;
  m_name = name;
  if (m_module) setModuleName(m_source, name);
  m_changed = true;
  project->componentEntryChanged(*this, oldName);
  project->vbe()->fireComponentRenamed(shared_from_this(), oldName);
}

ide::Ref<ide::VBForm> ComponentImpl::Designer() {
  return m_form;
}

ide::Ref<ide::Properties> ComponentImpl::Properties() {
  if (m_form) return m_form->Root()->Properties();
  return makeNameOnlyProperties(shared_from_this());
}

ide::Ref<ide::VBComponents> ComponentImpl::Collection() {
  auto project = m_project.lock();
  if (!project) ide::raise(ide::err::ObjectVariableNotSet);
  return project;
}

QString ComponentImpl::FileNames(int index) {
  if (index == 1) return m_filePath;
  if (index == 2 && FileCount() == 2) return binaryFilePath();
  ide::raise(ide::err::SubscriptOutOfRange);
}

QString ComponentImpl::binaryFilePath() const {
  if (m_filePath.isEmpty() || !m_source.form) return {};
  const QFileInfo info(m_filePath);
  // Forms keep their binary properties in a .frx (.ctx, .pgx, .dox for the others) beside them.
  static const std::pair<const char*, const char*> kBinary[] = {
      {"frm", "frx"}, {"ctl", "ctx"}, {"pag", "pgx"}, {"dob", "dox"}, {"dsr", "dsx"}};
  for (const auto& [source, binary] : kBinary)
    if (info.suffix().compare(QLatin1StringView(source), Qt::CaseInsensitive) == 0)
      return info.path() + u'/' + info.completeBaseName() + u'.' + QLatin1StringView(binary);
  return {};
}

int ComponentImpl::FileCount() {
  const QString binary = binaryFilePath();
  return !binary.isEmpty() && QFileInfo::exists(binary) ? 2 : 1;
}

void ComponentImpl::SaveAs(const QString& fileName) {
  auto project = m_project.lock();
  if (!project) ide::raise(ide::err::ObjectVariableNotSet);
  if (!m_module) ide::raise(ide::err::InvalidProcedureCall);
  QString target =
      QFileInfo(fileName).isAbsolute() ? fileName : QDir(project->directory()).absoluteFilePath(fileName);
  target = QFileInfo(target).absoluteFilePath();
  const QString oldPath = m_filePath;
  // Under a new name the form takes its binary file along under that name, as the IDE does (Form2.frm
  // refers to Form2.frx): the old pair stays as it was, and no longer shares its values with this form.
  std::vector<std::pair<FrxProperty, QString>> renamed;
  if (m_form && !m_form->binary().isEmpty() &&
      QFileInfo(target).completeBaseName().compare(QFileInfo(oldPath).completeBaseName(),
                                                   Qt::CaseInsensitive) != 0) {
    const QString name = QFileInfo(target).completeBaseName() + u'.' + QFileInfo(binaryFileName()).suffix();
    for (FrxProperty& property : frxProperties(m_form->description().root())) {
      FrxReference reference = property.reference;
      reference.fileName = name;
      const QString before = formatFrxReference(property.reference);
      property.group->setPropertyAt(property.name, property.occurrence, formatFrxReference(reference));
      renamed.emplace_back(std::move(property), before);
    }
  }
  const bool wasChanged = m_form && m_form->binaryChanged();
  if (!renamed.empty()) m_form->binaryMoved();
  // A binary file with changed values is written with the form; one without is copied along.
  const bool binaryWritten = m_form && m_form->binaryChanged();
  const QString oldBinary = FileCount() == 2 && !binaryWritten ? binaryFilePath() : QString();
  m_filePath = target;
  try {
    save(true);
    // The binary file goes along, under the name the description refers to it by.
    if (!oldBinary.isEmpty() && QFileInfo(oldPath).absolutePath() != QFileInfo(target).absolutePath()) {
      const QString copy = QFileInfo(target).absolutePath() + u'/' + QFileInfo(oldBinary).fileName();
      QFile::remove(copy);
      if (!QFile::copy(oldBinary, copy))
        ide::raise(ide::err::PathFileAccessError, QStringLiteral("Cannot write %1").arg(copy));
    }
  } catch (...) {
    m_filePath = oldPath;
    for (const auto& [property, before] : renamed)
      property.group->setPropertyAt(property.name, property.occurrence, before);
    if (!renamed.empty() && !wasChanged) m_form->binarySaved();
    throw;
  }
  project->componentEntryChanged(*this, m_name);
  if (oldPath != target) project->vbe()->fireFileNameChanged(project, fileTypeOf(m_type), target, oldPath);
}

std::shared_ptr<FormImpl> ComponentImpl::form() {
  return m_form;
}

std::shared_ptr<WindowImpl> ComponentImpl::designerWindow() {
  if (!m_form) return nullptr;
  if (!m_designerWindow) {
    auto project = m_project.lock();
    if (!project) ide::raise(ide::err::ObjectVariableNotSet);
    std::weak_ptr<ComponentImpl> weak = shared_from_this();
    m_designerWindow = std::make_shared<WindowImpl>(
        project->vbe(), ide::WindowType::Designer,
        [weak] {
          auto c = weak.lock();
          auto p = c ? c->project() : nullptr;
          return c && p
                     ? QStringLiteral("%1 - %2 (%3)").arg(p->Name(), c->Name(), componentTypeName(c->Type()))
                     : QString();
        },
        QStringLiteral("DesignerWindow"));
    m_designerWindow->setComponent(shared_from_this());
  }
  return m_designerWindow;
}

ide::Ref<ide::Window> ComponentImpl::DesignerWindow() {
  if (!m_form) ide::raise(ide::err::InvalidProcedureCall);
  return designerWindow();
}

void ComponentImpl::Activate() {
  auto project = m_project.lock();
  if (!project) ide::raise(ide::err::ObjectVariableNotSet);
  if (m_form) {
    project->vbe()->activateWindow(designerWindow());
  } else if (m_module) {
    m_module->pane()->Show();
  } else {
    project->vbe()->selectComponent(shared_from_this());
  }
}

void ComponentImpl::closeWindows() {
  if (m_module && m_module->hasPane()) m_module->pane()->window()->Close();
  if (m_designerWindow) m_designerWindow->Close();
}

void ComponentImpl::detach() {
  if (m_form)
    if (auto project = m_project.lock(); project && project->vbe())
      project->vbe()->events().forgetForm(m_form.get());
  m_project.reset();
}

}  // namespace host
