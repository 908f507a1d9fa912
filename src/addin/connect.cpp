// SPDX-License-Identifier: MIT
#include "addin/connect.h"

#include "addin/texts.h"
#include "common/errors.h"
#include "common/strings.h"
#include "common/uiutils.h"

namespace addin {

Connect::Connect(Environment environment) : m_environment(std::move(environment)) {
  if (!m_environment.machineConfig) m_environment.machineConfig = systemMachineConfig();
  if (!m_environment.createFeatures) m_environment.createFeatures = createFeatures;
}

Connect::~Connect() = default;

void Connect::OnConnection(const ide::Ref<ide::VBE>& application, ide::ConnectMode mode,
                           const ide::Ref<ide::AddIn>& addInInst, QVariantList&) {
  m_vbInstance = application;
  m_addInInstance = addInInst;
  if (mode != ide::ConnectMode::Startup) startup();
}

void Connect::OnStartupComplete(QVariantList&) {
  startup();
}

void Connect::OnAddInsUpdate(QVariantList&) {}

void Connect::OnDisconnection(ide::DisconnectMode mode, QVariantList&) {
  // Unloaded by the user, the add-in leaves projects that stay open and may still be saved.
  if (m_globals && mode == ide::DisconnectMode::UserClosed) {
    try {
      m_globals->features().projectsStayOpen();
    } catch (const std::exception& failure) {
      common::logFailure(failure, QStringLiteral("Connect"), QStringLiteral("OnDisconnection"), __LINE__);
    }
  }
  // Each part takes itself out of the IDE when released, in the order the members of Globals give; none
  // of them lets a failure stop the others.
  m_globals.reset();
}

void Connect::startup() {
  // The IDE may report the end of its start-up to an add-in that is running already.
  if (m_globals || !m_vbInstance) return;
  try {
    m_globals = startupRoutine();
  } catch (const std::exception& failure) {
    common::recordError(failure, QStringLiteral("Connect"), QStringLiteral("Startup"), __LINE__);
    common::logLastError();
    m_vbInstance->Platform().ui().MsgBox(QString::fromUtf16(kStartupFailed), ide::mb::Exclamation,
                                         common::title());
    unload();
  }
}

std::unique_ptr<Globals> Connect::startupRoutine() {
  ide::Platform& platform = m_vbInstance->Platform();
  StartupValues values;
  values.StartDisplayModel = m_vbInstance->DisplayModel();
  values.InstallDir = installationDirectory(*m_environment.machineConfig);
  if (values.InstallDir.isEmpty()) {
    platform.ui().MsgBox(QString::fromUtf16(kInstallDirMissing), ide::mb::Exclamation, common::title());
    unload();
    return nullptr;
  }
  const common::CHourGlass hourglass(platform.ui());
  common::SplashWindow splash(platform.ui(), platform.loop(), QString::fromUtf16(kSplashText));
  auto globals = std::make_unique<Globals>(m_vbInstance, m_addInInstance, std::move(values), m_environment);
  splash.close();
  return globals;
}

void Connect::unload() {
  try {
    if (m_addInInstance) m_addInInstance->setConnect(false);
  } catch (const std::exception& failure) {
    common::logFailure(failure, QStringLiteral("Connect"), QStringLiteral("unload"), __LINE__);
  }
}

}  // namespace addin
