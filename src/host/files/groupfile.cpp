// SPDX-License-Identifier: MIT
// Group files kept as their lines; the project entries are found by their keys when asked for.
#include "host/files/groupfile.h"

#include "ide/error.h"

namespace host {
namespace {

QStringView keyOf(QStringView text) {
  const qsizetype equals = text.indexOf(u'=');
  return equals < 0 ? QStringView() : text.left(equals).trimmed();
}

bool isStartupKey(QStringView key) {
  return key.compare(u"StartupProject", Qt::CaseInsensitive) == 0;
}

bool isProjectKey(QStringView key) {
  return isStartupKey(key) || key.compare(u"Project", Qt::CaseInsensitive) == 0;
}

[[noreturn]] void failAt(const QString& fileName, std::size_t lineIndex, const QString& problem) {
  throw ide::Error(ide::err::InvalidFileFormat,
                   QStringLiteral("%1, line %2: %3").arg(fileName).arg(lineIndex + 1).arg(problem));
}

}  // namespace

GroupFile::GroupFile(LineEnd lineEnd) {
  m_lines.push_back({QStringLiteral("VBGROUP 5.0"), lineEnd});
}

GroupFile GroupFile::parse(const std::vector<SourceLine>& lines, const QString& fileName) {
  const QString first = lines.empty() ? QString() : lines[0].text.trimmed();
  const bool isGroup = first.startsWith(u"VBGROUP", Qt::CaseInsensitive) &&
                       (first.size() == 7 || first[7] == u' ' || first[7] == u'\t');
  if (!isGroup)
    failAt(fileName, 0, QStringLiteral("not a project group: the first line must be VBGROUP 5.0"));
  for (std::size_t i = 1; i < lines.size(); ++i) {
    const QString& text = lines[i].text;
    if (!text.trimmed().isEmpty() && keyOf(text).isEmpty()) {
      failAt(fileName, i, QStringLiteral("not a \"Key=value\" line: %1").arg(text.trimmed().left(60)));
    }
  }
  GroupFile group;
  group.m_lines = lines;
  return group;
}

GroupFile GroupFile::parse(QByteArrayView bytes, const QString& fileName) {
  return parse(readSourceLines(bytes, fileName), fileName);
}

QByteArray GroupFile::toBytes(const QString& fileName) const {
  return writeSourceLines(m_lines, fileName);
}

std::vector<GroupProject> GroupFile::projects() const {
  std::vector<GroupProject> result;
  for (std::size_t i = 1; i < m_lines.size(); ++i) {
    const QString& text = m_lines[i].text;
    const QStringView key = keyOf(text);
    if (!isProjectKey(key)) continue;
    result.push_back({text.mid(text.indexOf(u'=') + 1).trimmed(), isStartupKey(key)});
  }
  return result;
}

int GroupFile::startupProject() const {
  const std::vector<GroupProject> all = projects();
  for (std::size_t i = 0; i < all.size(); ++i) {
    if (all[i].startup) return static_cast<int>(i);
  }
  return -1;
}

std::size_t GroupFile::projectLine(int index) const {
  int found = 0;
  for (std::size_t i = 1; i < m_lines.size() && index >= 0; ++i) {
    if (isProjectKey(keyOf(m_lines[i].text)) && found++ == index) return i;
  }
  throw ide::Error(ide::err::SubscriptOutOfRange,
                   QStringLiteral("No project number %1 in the group").arg(index));
}

void GroupFile::setStartupProject(int index) {
  const std::size_t target = index < 0 ? 0 : projectLine(index);
  for (std::size_t i = 1; i < m_lines.size(); ++i) {
    SourceLine& line = m_lines[i];
    const QStringView key = keyOf(line.text);
    if (!isProjectKey(key)) continue;
    const bool wanted = i == target;
    // Only the key changes; the path stays exactly as written.
    if (isStartupKey(key) != wanted) {
      const QString rest = line.text.mid(line.text.indexOf(u'='));
      line.text = (wanted ? QStringLiteral("StartupProject") : QStringLiteral("Project")) + rest;
    }
  }
}

void GroupFile::addProject(const QString& path) {
  std::size_t position = m_lines.size();
  for (std::size_t i = m_lines.size(); i > 1; --i) {
    if (isProjectKey(keyOf(m_lines[i - 1].text))) {
      position = i;
      break;
    }
  }
  if (position == m_lines.size()) {
    // No project yet: after the VBGROUP line and anything else, but before trailing blank lines.
    while (position > 1 && m_lines[position - 1].text.trimmed().isEmpty())
      --position;
  }
  insertSourceLine(m_lines, position, QStringLiteral("Project=") + path);
}

void GroupFile::removeProject(int index) {
  m_lines.erase(m_lines.begin() + static_cast<std::ptrdiff_t>(projectLine(index)));
}

}  // namespace host
