// SPDX-License-Identifier: MIT
#include "projinfofixture.h"

#include "navigation/favorites.h"
#include "projinfo/storage/mdlstorage.h"
#include "testproject.h"

#include <QDir>

namespace projinfo::test {

Scene::Scene() : m_oldTemp(qgetenv("TMPDIR")) {
  // A project never saved keeps its info file in the temporary directory: this test's own.
  QDir().mkpath(path(u"tmp"_qs));
  QDir().mkpath(path(u"install"_qs));
  qputenv("TMPDIR", path(u"tmp"_qs).toLocal8Bit());
  qputenv("QUIMBEL_DATA_DIR", path(u"data"_qs).toLocal8Bit());
  appInfo.OpenFile(path(u"install"_qs));
  services.vbe = vbe.get();
  services.appInfo = &appInfo;
  services.createFavorites = [](CProjInfo& info) -> std::unique_ptr<InfoRecordList> {
    return std::make_unique<navigation::CFavorites>(info, nullptr);
  };
}

Scene::~Scene() {
  infos.reset();
  qputenv("TMPDIR", m_oldTemp);
}

QString Scene::writeProject(const QString& folder, const QList<std::pair<QString, QString>>& modules) const {
  QByteArray vbp = "Type=Exe\r\n";
  for (const auto& [name, text] : modules) {
    vbp += "Module=" + name.toLatin1() + "; " + name.toLatin1() + ".bas\r\n";
    host::test::writeBytes(path(folder + u'/' + name + u".bas"_qs),
                           "Attribute VB_Name = \"" + name.toLatin1() + "\"\r\n" + text.toLatin1());
  }
  vbp += "Name=\"Loja\"\r\n";
  const QString file = path(folder + u"/Proj.vbp"_qs);
  host::test::writeBytes(file, vbp);
  return file;
}

std::shared_ptr<host::ProjectImpl> Scene::open(const QString& vbp) {
  if (!infos) infos = std::make_unique<ProjInfos>(services);
  auto project = vbe->openProject(vbp);
  infos->projectAdded(project);
  return project;
}

std::shared_ptr<host::ProjectImpl> Scene::newProject() {
  if (!infos) infos = std::make_unique<ProjInfos>(services);
  auto project = vbe->newProject();
  infos->projectAdded(project);
  return project;
}

void Scene::close(const std::shared_ptr<host::ProjectImpl>& project) {
  infos->projectRemoved(project);
  vbe->removeProject(project);
}

std::shared_ptr<CTaskItem> Scene::addTask(const std::shared_ptr<host::ProjectImpl>& project,
                                          const QString& name, const QString& text) {
  auto task = std::make_shared<CTaskItem>();
  task->Name = name;
  task->Text = text;
  return tasks(project).AddTask(task);
}

QStringList Scene::takeMessages() {
  QStringList texts;
  for (const auto& box : vbe->headlessUi()->messageBoxes())
    texts << box.prompt;
  vbe->headlessUi()->clearMessageBoxes();
  return texts;
}

QStringList streamsOf(const QString& infoFile, const QString& storage) {
  QStringList names;
  for (const VBSTATSTG& element :
       OpenDocFileForReading(infoFile)->OpenStorage(storage, STGM_READ)->Elements())
    names << element.Name();
  return names;
}

}  // namespace projinfo::test
