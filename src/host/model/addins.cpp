// SPDX-License-Identifier: MIT
#include "host/model/addins.h"

#include "host/model/vbe.h"

#include <QFileInfo>

namespace host {
namespace {

inline constexpr long kErrorLoadingDll = 48;

struct LibraryEntryPoints {
  IdeAddInDescribeFn describe = nullptr;
  IdeAddInCreateFn create = nullptr;
};

LibraryEntryPoints resolve(QLibrary& library) {
  if (!library.isLoaded() && !library.load())
    ide::raise(kErrorLoadingDll,
               QStringLiteral("Error loading add-in %1: %2").arg(library.fileName(), library.errorString()));
  LibraryEntryPoints entry;
  entry.describe = reinterpret_cast<IdeAddInDescribeFn>(library.resolve(kIdeAddInDescribeSymbol));
  entry.create = reinterpret_cast<IdeAddInCreateFn>(library.resolve(kIdeAddInCreateSymbol));
  if (!entry.describe || !entry.create)
    ide::raise(kErrorLoadingDll, QStringLiteral("%1 is not an add-in library").arg(library.fileName()));
  return entry;
}

}  // namespace

AddInImpl::AddInImpl(const std::shared_ptr<VbeImpl>& vbe, QString libraryPath, QString progId,
                     QString description, bool loadOnStartup, QString details)
    : m_vbe(vbe),
      m_libraryPath(std::move(libraryPath)),
      m_progId(std::move(progId)),
      m_description(std::move(description)),
      m_details(std::move(details)),
      m_loadOnStartup(loadOnStartup),
      m_library(m_libraryPath) {}

AddInImpl::~AddInImpl() = default;

ide::Ref<ide::VBE> AddInImpl::VBE() {
  return m_vbe.lock();
}

void AddInImpl::connect(ide::ConnectMode mode) {
  if (m_connection && !m_disconnectPending) return;
  if (m_connection) disconnect(ide::DisconnectMode::UserClosed);
  auto vbe = m_vbe.lock();
  if (!vbe) ide::raise(ide::err::ObjectVariableNotSet);
  const LibraryEntryPoints entry = resolve(m_library);
  m_connection.reset(entry.create());
  if (!m_connection)
    ide::raise(kErrorLoadingDll, QStringLiteral("%1 did not create its connection").arg(m_progId));
  ++m_connectionCount;
  QVariantList custom;
  m_connection->OnConnection(vbe, mode, shared_from_this(), custom);
  vbe->addIns().notifyUpdate();
}

void AddInImpl::startupComplete() {
  if (!m_connection || m_disconnectPending) return;
  QVariantList custom;
  m_connection->OnStartupComplete(custom);
}

void AddInImpl::addInsUpdate() {
  if (!m_connection || m_disconnectPending) return;
  QVariantList custom;
  m_connection->OnAddInsUpdate(custom);
}

void AddInImpl::disconnect(ide::DisconnectMode mode) {
  if (!m_connection) return;
  m_disconnectPending = false;
  QVariantList custom;
  // Taken out first: whatever the add-in does while it disconnects, it is no longer connected.
  std::unique_ptr<ide::IDTExtensibility> connection = std::move(m_connection);
  connection->OnDisconnection(mode, custom);
  connection.reset();
  if (auto vbe = m_vbe.lock()) vbe->addIns().notifyUpdate();
}

void AddInImpl::setConnect(bool connect) {
  if (connect) {
    m_disconnectPending = false;
    this->connect(ide::ConnectMode::AfterStartup);
    return;
  }
  if (!m_connection || m_disconnectPending) return;
  auto vbe = m_vbe.lock();
  if (!vbe) return;
  m_disconnectPending = true;
  std::weak_ptr<AddInImpl> weak = weak_from_this();
  vbe->platform().loop().post([weak] {
    if (auto self = weak.lock(); self && self->m_disconnectPending)
      self->disconnect(ide::DisconnectMode::UserClosed);
  });
}

// ---------------------------------------------------------------------------------------------------

AddInsImpl::AddInsImpl(const std::shared_ptr<VbeImpl>& vbe) : m_vbe(vbe) {}
AddInsImpl::~AddInsImpl() = default;

ide::Ref<ide::AddIn> AddInsImpl::Item(int index) {
  if (index < 1 || index > Count()) ide::raise(ide::err::SubscriptOutOfRange);
  return m_addIns[static_cast<size_t>(index - 1)];
}

ide::Ref<ide::AddIn> AddInsImpl::Item(const QString& progId) {
  for (const auto& addIn : m_addIns)
    if (addIn->ProgId().compare(progId, Qt::CaseInsensitive) == 0) return addIn;
  ide::raise(ide::err::SubscriptOutOfRange);
}

std::shared_ptr<AddInImpl> AddInsImpl::registerLibrary(const QString& path, bool loadOnStartup) {
  const QString absolute = QFileInfo(path).absoluteFilePath();
  QLibrary library(absolute);
  const LibraryEntryPoints entry = resolve(library);
  const ide::AddInDescription* description = entry.describe();
  if (!description || !description->progId)
    ide::raise(kErrorLoadingDll, QStringLiteral("%1 does not describe itself").arg(absolute));
  const QString progId = QString::fromUtf8(description->progId);
  const QString text = QString::fromUtf8(description->description ? description->description : "");
  const QString details = QString::fromUtf8(description->details ? description->details : "");
  for (const auto& existing : m_addIns) {
    if (existing->ProgId().compare(progId, Qt::CaseInsensitive) != 0) continue;
    existing->setLoadOnStartup(loadOnStartup);
    return existing;
  }
  auto addIn = std::make_shared<AddInImpl>(m_vbe.lock(), absolute, progId, text, loadOnStartup, details);
  m_addIns.push_back(addIn);
  return addIn;
}

void AddInsImpl::notifyUpdate() {
  for (const auto& addIn : std::vector(m_addIns))
    addIn->addInsUpdate();
}

}  // namespace host
