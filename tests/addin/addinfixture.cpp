// SPDX-License-Identifier: MIT
#include "addinfixture.h"

#include "common/strings.h"
#include "host/model/commandbars.h"
#include "host/model/objects.h"

#include <QDir>
#include <QFile>

#include <functional>

namespace addin::test {

AddInEnvironment::AddInEnvironment() {
  QDir(m_dir.path()).mkpath(u"install/help"_qs);
  QFile index(path(u"install/help/index.html"_qs));
  index.open(QIODevice::WriteOnly);
  index.write("<html></html>");
  index.close();
  writeMachineConfig(u"InstallationPath="_qs + installDir() + u'\n');
  qputenv("QUIMBEL_CONFIG_DIR", path(u"config"_qs).toLocal8Bit());
  qputenv("QUIMBEL_DATA_DIR", path(u"data"_qs).toLocal8Bit());
  qputenv("QUIMBEL_MACHINE_CONFIG", machineConfigPath().toLocal8Bit());
}

AddInEnvironment::~AddInEnvironment() {
  qunsetenv("QUIMBEL_CONFIG_DIR");
  qunsetenv("QUIMBEL_DATA_DIR");
  qunsetenv("QUIMBEL_MACHINE_CONFIG");
}

void AddInEnvironment::writeMachineConfig(const QString& text) const {
  QFile file(machineConfigPath());
  file.setPermissions(QFile::ReadOwner | QFile::WriteOwner);
  file.open(QIODevice::WriteOnly | QIODevice::Truncate);
  file.write(text.toUtf8());
}

QStringList AddInEnvironment::errorLog() const {
  QFile file(path(u"data/errors.log"_qs));
  if (!file.open(QIODevice::ReadOnly)) return {};
  return QString::fromUtf8(file.readAll()).split(u'\n', Qt::SkipEmptyParts);
}

QString commandBarsSnapshot(ide::CommandBars& bars) {
  QStringList lines;
  std::function<void(ide::CommandBar&, const QString&)> dump = [&](ide::CommandBar& bar,
                                                                   const QString& indent) {
    auto controls = bar.Controls();
    for (int i = 1; i <= controls->Count(); ++i) {
      auto control = controls->Item(i);
      lines << u"%1%2 [%3] type %4 tag %5 enabled %6"_qs.arg(indent)
                   .arg(i)
                   .arg(control->Caption())
                   .arg(static_cast<int>(control->Type()))
                   .arg(control->Tag())
                   .arg(control->Enabled());
      if (auto popup = control->CommandBar()) dump(*popup, indent + u"  "_qs);
    }
  };
  for (int i = 1; i <= bars.Count(); ++i) {
    auto bar = bars.Item(i);
    lines << u"bar %1 visible %2"_qs.arg(bar->Name()).arg(bar->Visible());
    dump(*bar, u"  "_qs);
  }
  return lines.join(u'\n');
}

int quimbelPopups(ide::VBE& vbe) {
  auto controls = vbe.CommandBars()->Item(u"Menu Bar"_qs)->Controls();
  int count = 0;
  for (int i = 1; i <= controls->Count(); ++i)
    if (controls->Item(i)->Caption() == common::title()) ++count;
  return count;
}

int quimbelToolBars(ide::VBE& vbe) {
  auto bars = vbe.CommandBars();
  int count = 0;
  for (int i = 1; i <= bars->Count(); ++i)
    if (bars->Item(i)->Name() == QLatin1StringView("Quimbel 2.2")) ++count;
  return count;
}

host::AddInImpl& registerRealAddIn(host::VbeImpl& vbe, bool loadAtStartup) {
  return *vbe.addIns().registerLibrary(QStringLiteral(QUIMBEL_ADDIN_LIBRARY), loadAtStartup);
}

void RecordingHotKeyClient::registerHotKeys(ide::HWnd window) {
  for (const TestHotKey& key : m_keys)
    m_windows.RegisterHotKey(window, key.id, key.modifiers, key.virtualKey);
  registeredOn = window;
  log << u"%1 register"_qs.arg(m_name);
}

void RecordingHotKeyClient::unregisterHotKeys(ide::HWnd window) {
  for (const TestHotKey& key : m_keys)
    m_windows.UnregisterHotKey(window, key.id);
  if (registeredOn == window) registeredOn = 0;
  log << u"%1 unregister"_qs.arg(m_name);
}

void RecordingFeatures::addFavorite(const FavoritePlace& place) {
  note(u"favorite %1.%2 kind %3 line %4"_qs
           .arg(place.component ? place.component->Name() : QString(), place.procName)
           .arg(static_cast<int>(place.procKind))
           .arg(place.line));
}

LinkedAddIn::LinkedAddIn(ide::DisplayModel displayModel) {
  host::IdeOptions options;
  options.displayModel = displayModel;
  vbe = host::VbeImpl::create(std::move(options));
  addIn = std::make_shared<FakeAddIn>(vbe);
}

LinkedAddIn::~LinkedAddIn() {
  disconnect();
}

void LinkedAddIn::connect() {
  Environment environment;
  environment.createFeatures = [this](const FeatureServices&) {
    auto features = std::make_unique<RecordingFeatures>(featureLog, failingFeature);
    features->copyBuffersClient = copyBuffers;
    features->macrosClient = macros;
    return features;
  };
  connection = std::make_unique<addin::Connect>(std::move(environment));
  QVariantList custom;
  connection->OnConnection(vbe, ide::ConnectMode::AfterStartup, addIn, custom);
}

void LinkedAddIn::disconnect() {
  if (!connection) return;
  QVariantList custom;
  connection->OnDisconnection(ide::DisconnectMode::UserClosed, custom);
  connection.reset();
}

namespace {
ide::Ref<ide::CommandBarControl> findControl(const ide::Ref<ide::CommandBar>& bar, const QString& caption) {
  auto controls = bar->Controls();
  for (int i = 1; i <= controls->Count(); ++i) {
    auto control = controls->Item(i);
    if (control->Caption() == caption || control->TooltipText() == caption) return control;
  }
  return nullptr;
}
}  // namespace

void LinkedAddIn::clickToolBar(common::CommandId command) {
  auto button = findControl(vbe->CommandBars()->Item(u"Quimbel 2.2"_qs),
                            common::LoadResString(static_cast<int>(command)));
  if (button) button->Execute();
}

void LinkedAddIn::clickMenu(common::CommandId command) {
  auto popup = vbe->CommandBars()->Item(u"Menu Bar"_qs)->Controls()->Item(common::title());
  if (auto item = findControl(popup->CommandBar(), common::LoadResString(static_cast<int>(command))))
    item->Execute();
}

QStringList LinkedAddIn::takeFeatureLog() {
  return std::exchange(featureLog, {});
}

std::shared_ptr<host::ComponentImpl> addModule(const std::shared_ptr<host::ProjectImpl>& project,
                                               const QString& name, int procedures, int linesEach) {
  auto component =
      std::dynamic_pointer_cast<host::ComponentImpl>(project->Add(ide::ComponentType::StdModule));
  component->setName(name);
  QStringList lines{u"Option Explicit"_qs, u"Private m As Long"_qs};
  for (int p = 1; p <= procedures; ++p) {
    lines << u"Public Sub Proc%1()"_qs.arg(p);
    for (int l = 0; l < linesEach - 2; ++l)
      lines << u"    m = m + %1"_qs.arg(l);
    lines << u"End Sub"_qs;
  }
  component->CodeModule()->AddFromString(lines.join(u"\r\n"_qs));
  return component;
}

ide::Ref<ide::CodePane> showAt(const std::shared_ptr<host::ComponentImpl>& component, int topLine) {
  auto pane = component->CodeModule()->CodePane();
  pane->Show();
  pane->setTopLine(topLine);
  return pane;
}

}  // namespace addin::test
