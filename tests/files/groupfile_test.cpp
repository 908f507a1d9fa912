// SPDX-License-Identifier: MIT
// Tests of project group files: byte-identical writing, the project list and its startup project, adding and
// removing projects, and the errors for files that are not groups.
#include "host/files/groupfile.h"

#include "testtext.h"

#include <gtest/gtest.h>

namespace host {
namespace {

using testing::asText;
using testing::expectError;
using testing::replacedOnce;
using testing::windowsFile;

constexpr const char* kGroup = R"(VBGROUP 5.0
Project=Utilitários\Utilitarios.vbp
StartupProject=Loja\Loja.vbp
Project=..\Comum\Relatorios.vbp
)";

class GroupFileTest : public ::testing::Test {
 protected:
  void SetUp() override { m_bytes = windowsFile(kGroup); }
  QByteArray written() const { return m_group.toBytes(u"Demo.vbg"_qs); }

  QByteArray m_bytes;
  GroupFile m_group = GroupFile::parse(windowsFile(kGroup), u"Demo.vbg"_qs);
};

TEST_F(GroupFileTest, ListsProjectsAndTheStartupProjectAndWritesBackByteForByte) {
  EXPECT_EQ(asText(written()), asText(m_bytes));
  const std::vector<GroupProject> expected = {{QString::fromUtf8("Utilitários\\Utilitarios.vbp"), false},
                                              {u"Loja\\Loja.vbp"_qs, true},
                                              {u"..\\Comum\\Relatorios.vbp"_qs, false}};
  EXPECT_EQ(m_group.projects(), expected);
  EXPECT_EQ(m_group.startupProject(), 1);
}

TEST_F(GroupFileTest, ChangesTheStartupProjectByRewritingTwoKeys) {
  m_group.setStartupProject(2);
  QByteArray expected = replacedOnce(m_bytes, "StartupProject=Loja\\Loja.vbp\n", "Project=Loja\\Loja.vbp\n");
  expected = replacedOnce(expected, "Project=..\\Comum", "StartupProject=..\\Comum");
  EXPECT_EQ(asText(written()), asText(expected));
  EXPECT_EQ(m_group.startupProject(), 2);

  m_group.setStartupProject(2);  // already
  EXPECT_EQ(asText(written()), asText(expected));

  m_group.setStartupProject(-1);
  EXPECT_EQ(m_group.startupProject(), -1);
  EXPECT_EQ(asText(written()), asText(replacedOnce(m_bytes, "StartupProject=Loja", "Project=Loja")));
  EXPECT_EQ(expectError([&] { m_group.setStartupProject(3); }).number(), ide::err::SubscriptOutOfRange);
}

TEST_F(GroupFileTest, AddsProjectsAfterTheLastOne) {
  m_group.addProject(u"Novo\\Novo.vbp"_qs);
  EXPECT_EQ(asText(written()),
            asText(replacedOnce(m_bytes, "Relatorios.vbp\n", "Relatorios.vbp\nProject=Novo\\Novo.vbp\n")));
  EXPECT_EQ(m_group.projects().size(), 3u + 1u);
  EXPECT_EQ(m_group.projects().back().path, u"Novo\\Novo.vbp");
}

TEST_F(GroupFileTest, RemovesProjects) {
  m_group.removeProject(1);
  EXPECT_EQ(asText(written()), asText(replacedOnce(m_bytes, "StartupProject=Loja\\Loja.vbp\n", "")));
  EXPECT_EQ(m_group.startupProject(), -1);
  EXPECT_EQ(m_group.projects().size(), 2u);
  EXPECT_EQ(expectError([&] { m_group.removeProject(2); }).number(), ide::err::SubscriptOutOfRange);
  EXPECT_EQ(expectError([&] { m_group.removeProject(-1); }).number(), ide::err::SubscriptOutOfRange);
}

TEST(GroupFileCreateTest, NewGroupsStartWithTheSignature) {
  GroupFile group;
  group.addProject(u"A\\A.vbp"_qs);
  group.addProject(u"B\\B.vbp"_qs);
  group.setStartupProject(0);
  EXPECT_EQ(group.toBytes(u"G.vbg"_qs),
            QByteArray("VBGROUP 5.0\r\nStartupProject=A\\A.vbp\r\nProject=B\\B.vbp\r\n"));
}

TEST(GroupFileCreateTest, KeepsLineEndsAndOtherKeys) {
  const QByteArray bytes("VBGROUP 5.0\nStartupProject=A.vbp\nExtra=1\nProject=B.vbp");
  GroupFile group = GroupFile::parse(bytes, u"G.vbg"_qs);
  EXPECT_EQ(group.toBytes(u"G.vbg"_qs), bytes);
  EXPECT_EQ(group.projects().size(), 2u);
  group.addProject(u"C.vbp"_qs);
  EXPECT_EQ(group.toBytes(u"G.vbg"_qs),
            QByteArray("VBGROUP 5.0\nStartupProject=A.vbp\nExtra=1\nProject=B.vbp\nProject=C.vbp"));

  GroupFile empty = GroupFile::parse(QByteArray("VBGROUP 5.0\r\n\r\n"), u"G.vbg"_qs);
  empty.addProject(u"A.vbp"_qs);
  EXPECT_EQ(empty.toBytes(u"G.vbg"_qs), QByteArray("VBGROUP 5.0\r\nProject=A.vbp\r\n\r\n"));
}

struct MalformedGroup {
  QByteArray bytes;
  const char* description;
};

class GroupFileErrorTest : public ::testing::TestWithParam<MalformedGroup> {};

TEST_P(GroupFileErrorTest, NamesTheFileAndTheLine) {
  const ide::Error error = expectError([&] { GroupFile::parse(GetParam().bytes, u"Demo.vbg"_qs); });
  EXPECT_EQ(error.number(), ide::err::InvalidFileFormat);
  EXPECT_EQ(error.description(), QString::fromUtf8(GetParam().description));
}

INSTANTIATE_TEST_SUITE_P(
    Malformed, GroupFileErrorTest,
    ::testing::Values(
        MalformedGroup{QByteArray(),
                       "Demo.vbg, line 1: not a project group: the first line must be VBGROUP 5.0"},
        MalformedGroup{QByteArray("Type=Exe\r\nName=\"P\"\r\n"),
                       "Demo.vbg, line 1: not a project group: the first line must be VBGROUP 5.0"},
        MalformedGroup{QByteArray("VBGROUPS 5.0\r\n"),
                       "Demo.vbg, line 1: not a project group: the first line must be VBGROUP 5.0"},
        MalformedGroup{QByteArray("VBGROUP 5.0\r\nProject=A.vbp\r\nB.vbp\r\n"),
                       "Demo.vbg, line 3: not a \"Key=value\" line: B.vbp"},
        MalformedGroup{QByteArray("VBGROUP 5.0\r\nProject=A.vbp\r\n\x01\0\r\n", 31),
                       "Demo.vbg, line 3: not a text file"}));

}  // namespace
}  // namespace host
