// SPDX-License-Identifier: MIT
// The repository's example project group read from disk through the whole file layer: the group, its
// projects and every component they list are found, parsed, and written back byte for byte.
#include "host/files/fileio.h"
#include "host/files/groupfile.h"
#include "host/files/modulefile.h"
#include "host/files/projectfile.h"

#include <gtest/gtest.h>

#include <QDir>
#include <QFileInfo>

namespace host {
namespace {

const QString kGroupPath = QStringLiteral(QUIMBEL_SOURCE_DIR "/examples/demo/Demo.vbg");

struct LoadedModule {
  QString path;
  ModuleSource source;
};

std::vector<LoadedModule> loadModules(const QString& projectPath, const ProjectFile& project) {
  std::vector<LoadedModule> modules;
  const QString folder = QFileInfo(projectPath).absolutePath();
  for (const ProjectComponent& component : project.components()) {
    if (component.kind == ComponentKind::RelatedDocument || component.kind == ComponentKind::ResourceFile)
      continue;
    const QString path = resolveProjectPath(folder, component.path);
    const QByteArray bytes = readFileBytes(path);
    ModuleSource source = parseModule(bytes, QFileInfo(path).fileName());
    EXPECT_EQ(writeModule(source, QFileInfo(path).fileName()), bytes) << path.toStdString();
    modules.push_back({path, std::move(source)});
  }
  return modules;
}

TEST(ExampleGroupTest, EveryFileOfTheGroupRoundTrips) {
  const QByteArray groupBytes = readFileBytes(kGroupPath);
  const GroupFile group = GroupFile::parse(groupBytes, QStringLiteral("Demo.vbg"));
  EXPECT_EQ(group.toBytes(QStringLiteral("Demo.vbg")), groupBytes);
  ASSERT_EQ(group.projects().size(), 2u);
  EXPECT_EQ(group.projects()[group.startupProject()].path, u"Loja\\Loja.vbp");

  QStringList loaded;
  for (const GroupProject& entry : group.projects()) {
    const QString projectPath = resolveProjectPath(QFileInfo(kGroupPath).absolutePath(), entry.path);
    ASSERT_TRUE(QFileInfo::exists(projectPath)) << projectPath.toStdString();
    const QByteArray bytes = readFileBytes(projectPath);
    const ProjectFile project = ProjectFile::parse(bytes, QFileInfo(projectPath).fileName());
    EXPECT_EQ(project.toBytes(QFileInfo(projectPath).fileName()), bytes);
    for (const LoadedModule& module : loadModules(projectPath, project))
      loaded.append(module.path);
  }
  // Every module file in the projects' folders is listed by its project and was loaded.
  QStringList onDisk;
  for (const char* folder : {"Loja", "Utilitarios"}) {
    const QDir directory(QFileInfo(kGroupPath).absolutePath() + u'/' + QString::fromLatin1(folder));
    for (const QString& name : directory.entryList({"*.bas", "*.cls", "*.frm", "*.ctl"}, QDir::Files)) {
      onDisk.append(directory.filePath(name));
    }
  }
  loaded.sort();
  onDisk.sort();
  EXPECT_EQ(loaded, onDisk);
  EXPECT_FALSE(loaded.isEmpty());
}

TEST(ExampleGroupTest, ShopProjectHasItsDocumentedParts) {
  const QString projectPath =
      resolveProjectPath(QFileInfo(kGroupPath).absolutePath(), QStringLiteral("Loja\\Loja.vbp"));
  const ProjectFile project = ProjectFile::parse(readFileBytes(projectPath), QStringLiteral("Loja.vbp"));
  EXPECT_EQ(project.name(), u"Loja");
  EXPECT_EQ(project.value(u"Type"), u"Exe");
  EXPECT_TRUE(project.references().contains(QStringLiteral("*\\A..\\Utilitarios\\Utilitarios.vbp")));

  for (const LoadedModule& module : loadModules(projectPath, project)) {
    const QString fileName = QFileInfo(module.path).fileName();
    EXPECT_EQ(moduleName(module.source) + u'.' + QFileInfo(module.path).suffix(), fileName);
    EXPECT_EQ(module.source.form.has_value(), fileName.endsWith(u".frm"));
    if (fileName == u"clsClientes.cls") {
      const auto hasDefaultMember =
          std::any_of(module.source.memberAttributes.begin(), module.source.memberAttributes.end(),
                      [](const MemberAttributeLine& line) {
                        return line.line.text == u"Attribute Item.VB_UserMemId = 0";
                      });
      EXPECT_TRUE(hasDefaultMember);
    }
    if (fileName == u"frmCliente.frm") {
      ASSERT_TRUE(module.source.form.has_value());
      const FormNode* option = module.source.form->root().findNode(u"optTipo", 1);
      ASSERT_NE(option, nullptr);
      EXPECT_EQ(option->className(), u"VB.OptionButton");
      EXPECT_EQ(option->parent()->className(), u"VB.Frame");
    }
  }
}

}  // namespace
}  // namespace host
