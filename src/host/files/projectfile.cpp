// SPDX-License-Identifier: MIT
// Project files kept as their lines: queries scan the few dozen lines of the main part, and edits replace,
// insert or erase single lines so that everything else is written back untouched.
#include "host/files/projectfile.h"

#include "host/files/vbliteral.h"
#include "ide/error.h"

#include <QDir>
#include <QFileInfo>

#include <algorithm>
#include <array>

namespace host {
namespace {

struct ComponentKeyName {
  ComponentKind kind;
  QStringView key;
};

constexpr std::array<ComponentKeyName, 9> kComponentKeys = {{{ComponentKind::Module, u"Module"},
                                                             {ComponentKind::Class, u"Class"},
                                                             {ComponentKind::Form, u"Form"},
                                                             {ComponentKind::UserControl, u"UserControl"},
                                                             {ComponentKind::PropertyPage, u"PropertyPage"},
                                                             {ComponentKind::UserDocument, u"UserDocument"},
                                                             {ComponentKind::Designer, u"Designer"},
                                                             {ComponentKind::RelatedDocument, u"RelatedDoc"},
                                                             {ComponentKind::ResourceFile, u"ResFile32"}}};

bool isSectionHeader(QStringView text) {
  const QStringView trimmed = text.trimmed();
  return trimmed.size() >= 2 && trimmed.front() == u'[' && trimmed.back() == u']';
}

QStringView sectionName(QStringView text) {
  const QStringView trimmed = text.trimmed();
  return trimmed.mid(1, trimmed.size() - 2).trimmed();
}

/// The key of a "Key=value" line (trimmed), or an empty view.
QStringView keyOf(QStringView text) {
  const qsizetype equals = text.indexOf(u'=');
  return equals < 0 ? QStringView() : text.left(equals).trimmed();
}

QStringView valueOf(QStringView text) {
  const qsizetype equals = text.indexOf(u'=');
  return equals < 0 ? QStringView() : text.mid(equals + 1);
}

std::optional<ComponentKind> componentKindOf(QStringView key) {
  for (const ComponentKeyName& entry : kComponentKeys) {
    if (entry.key.compare(key, Qt::CaseInsensitive) == 0) return entry.kind;
  }
  return std::nullopt;
}

bool hasName(ComponentKind kind) {
  return kind == ComponentKind::Module || kind == ComponentKind::Class;
}

ProjectComponent componentFromLine(ComponentKind kind, QStringView value) {
  ProjectComponent component;
  component.kind = kind;
  if (hasName(kind)) {
    const qsizetype separator = value.indexOf(u';');
    if (separator < 0) {
      component.name = value.trimmed().toString();
    } else {
      component.name = value.left(separator).trimmed().toString();
      component.path = value.mid(separator + 1).trimmed().toString();
    }
  } else if (kind == ComponentKind::ResourceFile) {
    component.path = unquoteVbString(value.trimmed()).value_or(value.trimmed().toString());
  } else {
    component.path = value.trimmed().toString();
  }
  return component;
}

QString lineForComponent(const ProjectComponent& component) {
  const QString key = componentKey(component.kind);
  if (hasName(component.kind)) return QStringLiteral("%1=%2; %3").arg(key, component.name, component.path);
  if (component.kind == ComponentKind::ResourceFile) return key + u'=' + quoteVbString(component.path);
  return key + u'=' + component.path;
}

[[noreturn]] void throwIndexError(const QString& what, int index) {
  throw ide::Error(ide::err::SubscriptOutOfRange, QStringLiteral("No %1 number %2").arg(what).arg(index));
}

}  // namespace

QString componentKey(ComponentKind kind) {
  for (const ComponentKeyName& entry : kComponentKeys) {
    if (entry.kind == kind) return entry.key.toString();
  }
  return {};
}

ProjectFile ProjectFile::parse(const std::vector<SourceLine>& lines, const QString& fileName) {
  for (std::size_t i = 0; i < lines.size(); ++i) {
    const QString& text = lines[i].text;
    if (isSectionHeader(text)) break;
    if (text.trimmed().isEmpty()) continue;
    if (keyOf(text).isEmpty()) {
      throw ide::Error(ide::err::InvalidFileFormat,
                       QStringLiteral("%1, line %2: not a \"Key=value\" line: %3")
                           .arg(fileName)
                           .arg(i + 1)
                           .arg(text.trimmed().left(60)));
    }
    // Without a file name the entry would name the project's own folder.
    const std::optional<ComponentKind> kind = componentKindOf(keyOf(text));
    if (kind && componentFromLine(*kind, valueOf(text)).path.trimmed().isEmpty()) {
      throw ide::Error(ide::err::InvalidFileFormat, QStringLiteral("%1, line %2: the entry names no file: %3")
                                                        .arg(fileName)
                                                        .arg(i + 1)
                                                        .arg(text.trimmed().left(60)));
    }
  }
  ProjectFile project;
  project.m_lines = lines;
  return project;
}

ProjectFile ProjectFile::parse(QByteArrayView bytes, const QString& fileName) {
  return parse(readSourceLines(bytes, fileName), fileName);
}

QByteArray ProjectFile::toBytes(const QString& fileName) const {
  return writeSourceLines(m_lines, fileName);
}

std::size_t ProjectFile::mainPartEnd() const {
  for (std::size_t i = 0; i < m_lines.size(); ++i) {
    if (isSectionHeader(m_lines[i].text)) return i;
  }
  return m_lines.size();
}

std::optional<std::size_t> ProjectFile::findKey(QStringView key, std::size_t from, std::size_t to) const {
  for (std::size_t i = from; i < to; ++i) {
    if (keyOf(m_lines[i].text).compare(key, Qt::CaseInsensitive) == 0) return i;
  }
  return std::nullopt;
}

std::optional<QString> ProjectFile::value(QStringView key) const {
  const std::optional<std::size_t> line = findKey(key, 0, mainPartEnd());
  if (!line) return std::nullopt;
  return valueOf(m_lines[*line].text).toString();
}

QStringList ProjectFile::values(QStringView key) const {
  QStringList result;
  const std::size_t end = mainPartEnd();
  for (std::size_t i = 0; i < end; ++i) {
    if (keyOf(m_lines[i].text).compare(key, Qt::CaseInsensitive) == 0) {
      result.append(valueOf(m_lines[i].text).toString());
    }
  }
  return result;
}

std::size_t ProjectFile::endOfMainEntries() const {
  std::size_t end = mainPartEnd();
  while (end > 0 && m_lines[end - 1].text.trimmed().isEmpty())
    --end;
  return end;
}

std::optional<std::size_t> ProjectFile::afterLastKey(std::initializer_list<QStringView> keys) const {
  std::optional<std::size_t> after;
  const std::size_t end = mainPartEnd();
  for (std::size_t i = 0; i < end; ++i) {
    const QStringView key = keyOf(m_lines[i].text);
    for (QStringView wanted : keys) {
      if (key.compare(wanted, Qt::CaseInsensitive) == 0) after = i + 1;
    }
  }
  return after;
}

void ProjectFile::setValue(const QString& key, const QString& rawValue) {
  const QString text = key + u'=' + rawValue;
  if (const std::optional<std::size_t> line = findKey(key, 0, mainPartEnd())) {
    if (m_lines[*line].text != text) m_lines[*line].text = text;
    return;
  }
  insertSourceLine(m_lines, endOfMainEntries(), text);
}

bool ProjectFile::removeValue(QStringView key) {
  const std::optional<std::size_t> line = findKey(key, 0, mainPartEnd());
  if (!line) return false;
  m_lines.erase(m_lines.begin() + static_cast<std::ptrdiff_t>(*line));
  return true;
}

QString ProjectFile::name() const {
  const std::optional<QString> raw = value(u"Name");
  if (!raw) return {};
  return unquoteVbString(raw->trimmed()).value_or(*raw);
}

void ProjectFile::setName(const QString& name) {
  setValue(QStringLiteral("Name"), quoteVbString(name));
}

std::vector<ProjectComponent> ProjectFile::components() const {
  std::vector<ProjectComponent> result;
  const std::size_t end = mainPartEnd();
  for (std::size_t i = 0; i < end; ++i) {
    const QString& text = m_lines[i].text;
    if (const std::optional<ComponentKind> kind = componentKindOf(keyOf(text))) {
      result.push_back(componentFromLine(*kind, valueOf(text)));
    }
  }
  return result;
}

std::size_t ProjectFile::componentLine(int index) const {
  const std::size_t end = mainPartEnd();
  int found = 0;
  for (std::size_t i = 0; i < end && index >= 0; ++i) {
    if (componentKindOf(keyOf(m_lines[i].text)) && found++ == index) return i;
  }
  throwIndexError(QStringLiteral("component"), index);
}

void ProjectFile::addComponent(const ProjectComponent& component) {
  std::optional<std::size_t> position;
  const std::size_t end = mainPartEnd();
  for (std::size_t i = 0; i < end; ++i) {
    if (componentKindOf(keyOf(m_lines[i].text))) position = i + 1;
  }
  if (!position) position = afterLastKey({u"Reference", u"Object"});
  if (!position) position = afterLastKey({u"Type"});
  insertSourceLine(m_lines, position.value_or(endOfMainEntries()), lineForComponent(component));
}

void ProjectFile::removeComponent(int index) {
  m_lines.erase(m_lines.begin() + static_cast<std::ptrdiff_t>(componentLine(index)));
}

void ProjectFile::setComponentName(int index, const QString& name) {
  SourceLine& line = m_lines[componentLine(index)];
  ProjectComponent component = componentFromLine(*componentKindOf(keyOf(line.text)), valueOf(line.text));
  if (!hasName(component.kind) || component.name == name) return;
  component.name = name;
  line.text = keyOf(line.text).toString() + u'=' + lineForComponent(component).section(u'=', 1);
}

void ProjectFile::setComponentPath(int index, const QString& path) {
  SourceLine& line = m_lines[componentLine(index)];
  ProjectComponent component = componentFromLine(*componentKindOf(keyOf(line.text)), valueOf(line.text));
  if (component.path == path) return;
  component.path = path;
  // Keep the key as the file spells it.
  line.text = keyOf(line.text).toString() + u'=' + lineForComponent(component).section(u'=', 1);
}

QStringList ProjectFile::references() const {
  return values(u"Reference");
}

std::size_t ProjectFile::referenceLine(int index) const {
  const std::size_t end = mainPartEnd();
  int found = 0;
  for (std::size_t i = 0; i < end && index >= 0; ++i) {
    if (keyOf(m_lines[i].text).compare(u"Reference", Qt::CaseInsensitive) == 0 && found++ == index) return i;
  }
  throwIndexError(QStringLiteral("reference"), index);
}

void ProjectFile::addReference(const QString& rawValue) {
  std::optional<std::size_t> position = afterLastKey({u"Reference"});
  if (!position) position = afterLastKey({u"Type"});
  insertSourceLine(m_lines, position.value_or(0), QStringLiteral("Reference=") + rawValue);
}

void ProjectFile::removeReference(int index) {
  m_lines.erase(m_lines.begin() + static_cast<std::ptrdiff_t>(referenceLine(index)));
}

QStringList ProjectFile::sections() const {
  QStringList result;
  for (const SourceLine& line : m_lines) {
    if (isSectionHeader(line.text)) result.append(sectionName(line.text).toString());
  }
  return result;
}

std::optional<QString> ProjectFile::sectionValue(QStringView section, QStringView key) const {
  bool inSection = false;
  for (const SourceLine& line : m_lines) {
    if (isSectionHeader(line.text)) {
      inSection = sectionName(line.text).compare(section, Qt::CaseInsensitive) == 0;
    } else if (inSection && keyOf(line.text).compare(key, Qt::CaseInsensitive) == 0) {
      return valueOf(line.text).toString();
    }
  }
  return std::nullopt;
}

void ProjectFile::setSectionValue(const QString& section, const QString& key, const QString& rawValue) {
  const QString text = key + u'=' + rawValue;
  std::optional<std::size_t> sectionStart;
  for (std::size_t i = 0; i < m_lines.size(); ++i) {
    if (isSectionHeader(m_lines[i].text) &&
        sectionName(m_lines[i].text).compare(section, Qt::CaseInsensitive) == 0) {
      sectionStart = i;
      break;
    }
  }
  if (!sectionStart) {
    insertSourceLine(m_lines, m_lines.size(), QStringLiteral("[") + section + u']');
    insertSourceLine(m_lines, m_lines.size(), text);
    return;
  }
  std::size_t sectionEnd = *sectionStart + 1;
  while (sectionEnd < m_lines.size() && !isSectionHeader(m_lines[sectionEnd].text))
    ++sectionEnd;
  if (const std::optional<std::size_t> line = findKey(key, *sectionStart + 1, sectionEnd)) {
    if (m_lines[*line].text != text) m_lines[*line].text = text;
    return;
  }
  std::size_t position = sectionEnd;
  while (position > *sectionStart + 1 && m_lines[position - 1].text.trimmed().isEmpty())
    --position;
  insertSourceLine(m_lines, position, text);
}

// --- Paths -----------------------------------------------------------------------------------------------

QString resolveProjectPath(const QString& baseDirectory, const QString& writtenPath) {
  QString path = writtenPath.trimmed();
  path.replace(u'\\', u'/');
  const bool hasDrive = path.size() >= 2 && path[1] == u':' && path[0].isLetter();
  if (hasDrive || path.startsWith(QStringLiteral("//"))) return path;

  const QString exact = QDir::cleanPath(QDir(baseDirectory).absoluteFilePath(path));
  if (QFileInfo::exists(exact)) return exact;

  // Walk down from the root, replacing each missing step by a case-insensitive match in its folder.
  const QStringList steps = exact.split(u'/', Qt::SkipEmptyParts);
  QString current = QStringLiteral("/");
  for (qsizetype i = 0; i < steps.size(); ++i) {
    const QString& step = steps[i];
    QString candidate = current.endsWith(u'/') ? current + step : current + u'/' + step;
    if (!QFileInfo::exists(candidate)) {
      const QStringList entries =
          QDir(current).entryList(QDir::AllEntries | QDir::Hidden | QDir::System | QDir::NoDotAndDotDot);
      const auto match = std::find_if(entries.begin(), entries.end(), [&](const QString& entry) {
        return entry.compare(step, Qt::CaseInsensitive) == 0;
      });
      if (match == entries.end()) return exact;  // nothing by that name: report the path as written
      candidate = current.endsWith(u'/') ? current + *match : current + u'/' + *match;
    }
    current = candidate;
  }
  return current;
}

QString projectRelativePath(const QString& baseDirectory, const QString& localPath) {
  QString relative = QDir(baseDirectory).relativeFilePath(localPath);
  relative.replace(u'/', u'\\');
  return relative;
}

}  // namespace host
