// SPDX-License-Identifier: MIT
// `quimbel tasks` and `quimbel favorites` on the info files the add-in writes, and the other way round.
#include "navigation/favorites.h"
#include "projinfofixture.h"
#include "testproject.h"

#include <gtest/gtest.h>

#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QProcess>

namespace projinfo::test {
namespace {

struct ToolRun {
  int exitCode = -1;
  QStringList out;
  QString err;
};

ToolRun quimbel(const QStringList& arguments) {
  QProcess process;
  process.start(QStringLiteral(QUIMBEL_BINARY), arguments);
  process.waitForFinished(60000);
  return {process.exitCode(),
          QString::fromLocal8Bit(process.readAllStandardOutput()).split(u'\n', Qt::SkipEmptyParts),
          QString::fromLocal8Bit(process.readAllStandardError())};
}

TEST(Tool, TasksAreListedAndChangedInTheFileTheAddInUses) {
  Scene scene;
  const QString bare = scene.writeProject(u"Sem"_qs, {{u"modA"_qs, u"Option Explicit\r\n"_qs}});
  const QByteArray bareBytes = host::test::readBytes(bare);
  EXPECT_EQ(quimbel({u"tasks"_qs, bare}).exitCode, 7);
  const ToolRun refused = quimbel({u"tasks"_qs, bare, u"add"_qs, u"Nova"_qs});
  EXPECT_EQ(refused.exitCode, 3);
  EXPECT_TRUE(refused.err.contains(u"no identifier module"_qs)) << refused.err.toStdString();
  EXPECT_EQ(host::test::readBytes(bare), bareBytes) << "the tool never inserts the module";

  const QString vbp = scene.writeProject(u"Loja"_qs, {{u"basQMInf000600"_qs, u"'PROJID=000600\r\n"_qs}});
  // No info file is not an empty list.
  const ToolRun none = quimbel({u"tasks"_qs, vbp});
  EXPECT_EQ(none.exitCode, 7);
  EXPECT_TRUE(none.err.contains(u"qm000600.qmi is not in its folder"_qs)) << none.err.toStdString();
  for (const QStringList& change :
       {QStringList{u"add"_qs, u"Revisar (frete)"_qs, u"--text"_qs, u"Tabela\nnova"_qs},
        QStringList{u"add"_qs, u"Conferir ação"_qs}, QStringList{u"done"_qs, u"2"_qs},
        QStringList{u"add"_qs, u"Sobra"_qs}, QStringList{u"remove"_qs, u"3"_qs}})
    EXPECT_EQ(quimbel(QStringList{u"tasks"_qs, vbp} + change).exitCode, 0) << change.join(u' ').toStdString();
  EXPECT_EQ(quimbel({u"tasks"_qs, vbp, u"undone"_qs, u"9"_qs}).exitCode, 8) << "a task of its own code";
  const QStringList listed = quimbel({u"tasks"_qs, vbp}).out;
  EXPECT_EQ(listed.mid(1), (QStringList{u"    1  [ ]  Revisar (frete)"_qs, u"           Tabela"_qs,
                                        u"           nova"_qs, u"    2  [x]  Conferir ação"_qs}));
  const QJsonDocument json =
      QJsonDocument::fromJson(quimbel({u"tasks"_qs, u"--json"_qs, vbp}).out.join(u'\n').toUtf8());
  EXPECT_EQ(json[u"project"_qs], u"Loja"_qs);
  EXPECT_EQ(
      json[u"tasks"_qs][1].toObject(),
      (QJsonObject{
          {u"id"_qs, 2}, {u"done"_qs, true}, {u"name"_qs, u"Conferir ação"_qs}, {u"text"_qs, QString()}}));

  // The add-in reads what the tool wrote; while it holds the file the tool may list but not change it.
  auto project = scene.open(vbp);
  EXPECT_EQ(scene.tasks(project).Tasks.Item(u"Task2"_qs)->Done, true);
  EXPECT_EQ(quimbel({u"tasks"_qs, vbp}).out, listed);
  const ToolRun held = quimbel({u"tasks"_qs, vbp, u"done"_qs, u"1"_qs});
  EXPECT_EQ(held.exitCode, 4);
  EXPECT_TRUE(held.err.contains(u"in use by"_qs)) << held.err.toStdString();
}

TEST(Tool, FavoritesAreListedWithModuleProcedureAndLine) {
  Scene scene;
  const QString vbp = scene.writeProject(
      u"Loja"_qs, {{u"basQMInf000601"_qs, u"'PROJID=000601\r\n"_qs},
                   {u"modA"_qs, u"Option Explicit\r\n\r\nSub Um()\r\n  x = 1\r\nEnd Sub\r\n"_qs}});
  auto project = scene.open(vbp);
  auto& favorites = *dynamic_cast<navigation::CFavorites*>(scene.info(project).Favorites());
  favorites.AddPlace(project->component(u"modA"_qs), u"Um"_qs, ide::ProcKind::Proc, 4);
  favorites.AddPlace(project->component(u"modA"_qs), {}, ide::ProcKind::Proc, 1);
  scene.close(project);
  const ToolRun run = quimbel({u"favorites"_qs, vbp});
  EXPECT_EQ(run.exitCode, 0) << run.err.toStdString();
  ASSERT_EQ(run.out.size(), 3);
  EXPECT_EQ(run.out[1].simplified(), u"1 modA Um line 4"_qs);
  EXPECT_EQ(run.out[2].simplified(), u"2 modA General Declarations line 1"_qs);
  const QJsonArray json =
      QJsonDocument::fromJson(
          quimbel({u"favorites"_qs, u"--json"_qs, vbp}).out.join(u'\n').toUtf8())[u"favorites"_qs]
          .toArray();
  ASSERT_EQ(json.size(), 2);
  EXPECT_EQ(json[0].toObject(), (QJsonObject{{u"id"_qs, 1},
                                             {u"module"_qs, u"modA"_qs},
                                             {u"procedure"_qs, u"Um"_qs},
                                             {u"kind"_qs, u"Procedure"_qs},
                                             {u"code_line"_qs, 4}}));
  EXPECT_EQ(json[1][u"kind"_qs], u"Declarations"_qs);
}

}  // namespace
}  // namespace projinfo::test
