// SPDX-License-Identifier: MIT
// Favourites in the headless IDE: where a place is stored and where it reopens as the code changes, and
// how the stored records follow renamed and removed components.
#include "navigation/favorites.h"
#include "common/strings.h"
#include "projinfo/records.h"
#include "projinfofixture.h"
#include "testproject.h"

#include <gtest/gtest.h>

namespace projinfo::test {
namespace {

using navigation::CFavorites;
using navigation::CFavoritesItem;

const QString kModule = QStringLiteral(
    "Option Explicit\r\n"                             // 1
    "Private m As Long\r\n"                           // 2
    "\r\n"                                            // 3
    "' Conta de um em um\r\n"                         // 4
    "Public Sub Um()\r\n"                             // 5
    "10  m = 1\r\n"                                   // 6
    "    GoTo 10\r\n"                                 // 7
    "End Sub\r\n"                                     // 8
    "Public Property Get Valor() As Long\r\n"         // 9
    "    Valor = m\r\n"                               // 10
    "End Property\r\n"                                // 11
    "Public Property Let Valor(ByVal v As Long)\r\n"  // 12
    "    m = v\r\n"                                   // 13
    "    m = m + 1\r\n"                               // 14
    "End Property\r\n");                              // 15

struct Project {
  Scene scene;
  std::shared_ptr<host::ProjectImpl> project = scene.open(scene.writeProject(
      u"Loja"_qs,
      {{u"basQMInf000300"_qs, u"'PROJID=000300\r\n"_qs}, {u"modA"_qs, kModule}, {u"modB"_qs, kModule}}));
  ide::Ref<ide::VBComponent> modA = project->component(u"modA"_qs);
  ide::Ref<ide::VBComponent> modB = project->component(u"modB"_qs);
  CFavorites& favorites() { return *dynamic_cast<CFavorites*>(scene.info(project).Favorites()); }
  QString file() const { return scene.path(u"Loja/qm000300.qmi"_qs); }
  /// Where a favourite reopens: the caret's line, or 0 when it cannot be shown.
  int reopen(const CFavoritesItem& item) {
    try {
      favorites().Open(item, nullptr);
    } catch (const ide::Error&) {
      return 0;
    }
    int line = 0, column = 0, endLine = 0, endColumn = 0;
    item.Component->CodeModule()->CodePane()->GetSelection(line, column, endLine, endColumn);
    return line;
  }
};

TEST(Favorites, APlaceIsStoredByItsProcedureAndReopensThereAsTheCodeChanges) {
  Project p;
  const struct {
    int line;
    const char* procName;
    ide::ProcKind kind;
    const char* storedName;
    int storedKind, storedLine;
  } kCases[] = {
      {2, "", ide::ProcKind::Proc, "General Declarations", 0, 2},
      {5, "Um", ide::ProcKind::Proc, "Um", 0, 2},  // two lines below the start, the comment above counted
      {7, "Um", ide::ProcKind::Proc, "Um", 0, 4},
      {13, "Valor", ide::ProcKind::Let, "Valor", 1, 1},
      {10, "Valor", ide::ProcKind::Get, "Valor", 3, 1},
  };
  for (const auto& c : kCases) {
    p.favorites().AddPlace(p.modA, QString::fromLatin1(c.procName), c.kind, c.line);
    const auto item = p.favorites().Favorites.Item(p.favorites().Favorites.Count());
    EXPECT_EQ(item->ProcedureName, QString::fromLatin1(c.storedName)) << c.line;
    EXPECT_EQ(item->ProcKind, c.storedKind) << c.line;
    EXPECT_EQ(item->Line, c.storedLine) << c.line;
    EXPECT_EQ(p.reopen(*item), c.line) << "reopens where it was added, the Let in the Let";
  }
  EXPECT_TRUE(p.scene.takeMessages().isEmpty());

  // The declarations shrank, the procedure got shorter: the last line of each. Renamed: not shown.
  auto module = p.modA->CodeModule();
  module->DeleteLines(6, 2);
  EXPECT_EQ(p.reopen(*p.favorites().Favorites.Item(3)), 6) << "the procedure's last line";
  module->DeleteLines(2, 1);
  EXPECT_EQ(p.reopen(*p.favorites().Favorites.Item(1)), 1) << "the declarations' last line";
  module->ReplaceLine(4, u"Public Sub Dois()"_qs);
  EXPECT_EQ(p.reopen(*p.favorites().Favorites.Item(3)), 0);
  EXPECT_EQ(p.favorites().Favorites.Count(), 5) << "it stays in the list";

  // Outside any procedure past the declarations there is nothing to keep.
  p.favorites().AddPlace(nullptr, {}, ide::ProcKind::Proc, 3);
  EXPECT_EQ(p.scene.takeMessages(), QStringList{common::LoadResString(5084)});
}

TEST(Favorites, TheRecordsFollowRenamedComponentsAndGoWithRemovedOnes) {
  Project p;
  p.favorites().AddPlace(p.modA, u"Um"_qs, ide::ProcKind::Proc, 6);
  p.favorites().AddPlace(p.modB, u"Um"_qs, ide::ProcKind::Proc, 6);
  p.favorites().AddPlace(p.modB, {}, ide::ProcKind::Proc, 1);
  p.modA->setName(u"modPrincipal"_qs);
  p.scene.infos->componentRenamed(p.modA);
  p.scene.infos->componentRemoved(p.modB);
  p.project->Remove(p.modB);
  EXPECT_EQ(streamsOf(p.file(), u"Favorites"_qs), QStringList{u"Favorite1"_qs});
  p.project->save();
  p.scene.close(p.project);

  auto again = p.scene.open(p.scene.path(u"Loja/Proj.vbp"_qs));
  auto& favorites = *dynamic_cast<CFavorites*>(p.scene.info(again).Favorites());
  ASSERT_EQ(favorites.Favorites.Count(), 1);
  EXPECT_EQ(favorites.Favorites.Item(1)->Component->Name(), u"modPrincipal"_qs);
}

TEST(Favorites, RecordsThatCannotBeReadAreToldOnceAndStayInTheFile) {
  Project p;
  p.favorites().AddPlace(p.modA, u"Um"_qs, ide::ProcKind::Proc, 6);
  Storage& storage = *p.scene.info(p.project).favoritesStorage();
  storage.CreateStream(u"Favorite8"_qs, kElementMode)
      ->WriteData(FavoriteRecord{u"modSumido"_qs, u"Main"_qs, 0, 8, 1}.toText());
  storage.CreateStream(u"Favorite9"_qs, kElementMode)->WriteData(u"[ComponentName](modA)[Line](x)"_qs);
  p.scene.close(p.project);
  auto again = p.scene.open(p.scene.path(u"Loja/Proj.vbp"_qs));
  EXPECT_EQ(p.scene.takeMessages(), QStringList{common::LoadResString(5116)});
  EXPECT_EQ(dynamic_cast<CFavorites*>(p.scene.info(again).Favorites())->Favorites.Count(), 1);
  EXPECT_EQ(streamsOf(p.file(), u"Favorites"_qs).size(), 3);
  // The next favourite still gets a number of its own.
  dynamic_cast<CFavorites*>(p.scene.info(again).Favorites())
      ->AddPlace(again->component(u"modA"_qs), {}, {}, 1);
  EXPECT_TRUE(streamsOf(p.file(), u"Favorites"_qs).contains(u"Favorite10"_qs));
}

}  // namespace
}  // namespace projinfo::test
