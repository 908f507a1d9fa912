// SPDX-License-Identifier: MIT
// `quimbel find`: every occurrence of a text in the code of groups, projects or modules, as the add-in's
// extended find lists them (the same matching, the same order, overlapping occurrences included), with the
// place in the file for editors to jump to.
//
// The tool does not load the whole IDE model: a search over a large group would spend nearly all its time
// building code lines it never looks at. Each module file is read as bytes and searched there for the text
// (letter case folded as Find folds it); only the lines that can matter are turned into code lines: the
// file's header, the declarations section, hidden attribute lines, lines that may open or close a procedure
// (their first word), continued lines, and the lines holding a candidate. The module's own parser and code
// engine then read those lines in their order, so that the procedure of a line comes out exactly as the
// IDE's ProcOfLine gives it, and the matcher behind Find decides every occurrence. Wildcard searches, and
// files whose header this quick reading does not recognise, are read whole.
#include "cli.h"
#include "fileio/fileio.h"
#include "fileio/parallel.h"
#include "host/code/codetext.h"
#include "host/code/findmatcher.h"
#include "host/files/ansi.h"
#include "host/files/groupfile.h"
#include "host/files/modulefile.h"
#include "host/files/projectfile.h"
#include "ide/error.h"
#include "syntax/line.h"
#include "walk/walk.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QHash>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QSet>
#include <QStringBuilder>

#include <algorithm>
#include <array>
#include <cstring>
#include <optional>
#include <string_view>

namespace cli {
namespace {

/// A module file of an opened project.
struct ModuleEntry {
  QString project;
  QString path;       // absolute
  QString shownPath;  // as given for module files, else relative to the current directory
};

/// The module files of the files given, in the order the IDE lists them once it has opened the files.
struct Inputs {
  std::vector<ModuleEntry> modules;
  QStringList projectNames;
  /// Files a group or project lists that are missing (named on standard error as they were met).
  int missing = 0;
  /// Module files left out (--exclude).
  Exclusions exclusions;

  /// Reads a group, project or module file given on the command line; throws what cannot be read.
  void add(const QString& file) {
    const QString absolute = QFileInfo(file).absoluteFilePath();
    const QString suffix = QFileInfo(file).suffix().toLower();
    if (suffix == QLatin1StringView("vbg")) {
      const host::GroupFile group = host::GroupFile::parse(fileio::readFileBytes(absolute), file);
      const QString directory = QFileInfo(absolute).absolutePath();
      const std::vector<host::GroupProject> projects = group.projects();
      for (size_t i = 0; i < projects.size(); ++i) {
        const QString projectFile = host::resolveProjectPath(directory, projects[i].path);
        // As in the IDE, the group opens without a project that is missing.
        if (!QFileInfo::exists(projectFile)) {
          nameMissing(absolute, group.projectLine(int(i)), projects[i].path);
          continue;
        }
        addProject(projectFile);
      }
      return;
    }
    if (suffix == QLatin1StringView("vbp")) return addProject(absolute);
    static const QStringList kModuleSuffixes = {
        QStringLiteral("bas"), QStringLiteral("cls"), QStringLiteral("frm"), QStringLiteral("ctl"),
        QStringLiteral("pag"), QStringLiteral("dob"), QStringLiteral("dsr")};
    if (!kModuleSuffixes.contains(suffix))
      ide::raise(ide::err::InvalidFileFormat,
                 QStringLiteral("not a project group, project or module file (.vbg, .vbp, .%1)")
                     .arg(kModuleSuffixes.join(QStringLiteral(", ."))));
    if (!QFileInfo::exists(absolute)) ide::raise(ide::err::FileNotFound, QStringLiteral("file not found"));
    // A module file on its own goes into a new project, named as the IDE names new projects.
    QString name = QStringLiteral("Project1");
    for (int n = 2; projectNames.contains(name, Qt::CaseInsensitive); ++n)
      name = QStringLiteral("Project%1").arg(n);
    projectNames << name;
    addModule({name, absolute, file});
  }

 private:
  void addProject(const QString& projectFile) {
    const host::ProjectFile project =
        host::ProjectFile::parse(fileio::readFileBytes(projectFile), projectFile);
    QString name = project.name();
    if (name.isEmpty()) name = QFileInfo(projectFile).completeBaseName();
    projectNames << name;
    const QString directory = QFileInfo(projectFile).absolutePath();
    const QDir here = QDir::current();
    const std::vector<host::ProjectComponent> components = project.components();
    for (size_t i = 0; i < components.size(); ++i) {
      const QString path = host::resolveProjectPath(directory, components[i].path);
      // As in the IDE, the project opens without a file that is missing; its entry stays.
      if (!QFileInfo::exists(path)) {
        nameMissing(projectFile, project.componentLine(int(i)), components[i].path);
        continue;
      }
      if (components[i].kind == host::ComponentKind::RelatedDocument ||
          components[i].kind == host::ComponentKind::ResourceFile)
        continue;  // no code
      addModule({name, path, here.relativeFilePath(path)});
    }
  }

  /// As the other commands name a missing file: the group or project file from here, the entry's line.
  void nameMissing(const QString& listedIn, size_t lineIndex, const QString& entry) {
    printError(QStringLiteral("%1, line %2: file not found: %3")
                   .arg(QDir::current().relativeFilePath(listedIn))
                   .arg(lineIndex + 1)
                   .arg(entry));
    ++missing;
  }

  /// Each module file once, however often it was named.
  void addModule(ModuleEntry module) {
    if (exclusions.excludes(module.path)) return;
    const QString identity = fileIdentity(module.path);
    if (m_seen.contains(identity)) return;
    m_seen.insert(identity);
    modules.push_back(std::move(module));
  }

  QSet<QString> m_seen;
};

/// The search text as Windows-1252 bytes, each standing for every byte of the same letter in the other
/// case (unless case matters): the lines that can hold an occurrence are found without decoding the file.
class ByteNeedle {
 public:
  ByteNeedle(QStringView text, bool matchCase) {
    QHash<char16_t, quint8> byKey;
    for (int b = 0; b < 256; ++b) {
      const char byte = char(b);
      const QChar c = host::decodeAnsi(QByteArrayView(&byte, 1)).front();
      const char16_t key = (matchCase ? c : c.toCaseFolded()).unicode();
      m_canon[size_t(b)] = byKey.value(key, quint8(b));
      byKey.insert(key, m_canon[size_t(b)]);
    }
    // Find matches inside one line: a text holding a line end never matches.
    m_never = text.isEmpty() || text.contains(u'\r') || text.contains(u'\n');
    for (const QChar c : text) {
      const auto found = byKey.constFind((matchCase ? c : c.toCaseFolded()).unicode());
      if (found == byKey.constEnd()) {
        m_never = true;  // a character no byte of the code page stands for
        break;
      }
      m_needle.push_back(char(*found));
    }
    // Horspool's shifts, by raw byte: the bytes that stand for the needle's last character shift by 0, so
    // that the skip loop stops on them without a second lookup.
    const qsizetype m = m_needle.size();
    std::array<qsizetype, 256> shift;
    shift.fill(m);
    for (qsizetype i = 0; i + 1 < m; ++i)
      shift[quint8(m_needle[i])] = m - 1 - i;
    for (int b = 0; b < 256; ++b)
      m_skip[size_t(b)] =
          m > 0 && m_canon[size_t(b)] == quint8(m_needle[m - 1]) ? 0 : shift[m_canon[size_t(b)]];
    if (m > 0) m_lastShift = shift[quint8(m_needle[m - 1])];
  }

  /// The first occurrence in bytes[from, size), or -1.
  qsizetype indexIn(const char* bytes, qsizetype size, qsizetype from) const {
    if (m_never) return -1;
    const qsizetype m = m_needle.size();
    for (qsizetype i = from + m - 1; i < size; i += m_lastShift) {
      for (qsizetype skip = m_skip[quint8(bytes[i])]; skip != 0; skip = m_skip[quint8(bytes[i])]) {
        i += skip;
        if (i >= size) return -1;
      }
      qsizetype k = m - 2;
      while (k >= 0 && m_canon[quint8(bytes[i - (m - 1) + k])] == quint8(m_needle[k]))
        --k;
      if (k < 0) return i - (m - 1);
    }
    return -1;
  }

 private:
  std::array<quint8, 256> m_canon{};
  std::array<qsizetype, 256> m_skip{};
  qsizetype m_lastShift = 1;
  QByteArray m_needle;
  bool m_never = false;
};

struct Search {
  host::FindMatcher matcher;
  /// Only for plain-text searches: what marks the lines worth decoding.
  std::optional<ByteNeedle> needle;
};

struct Occurrence {
  int line = 0;      // in the code module
  int fileLine = 0;  // in the file
  int column = 0;
  QString procedure;
  QString text;
};

struct ScannedModule {
  QString name;
  /// The file is UTF-8 with letters outside ASCII, read in the ANSI code page.
  bool looksLikeUtf8 = false;
  std::vector<Occurrence> occurrences;
  QByteArray rows;  // as printed
};

/// One line of a file: where its text's bytes are (without the line end), the line end, its number.
struct LineSpan {
  qsizetype start = 0;
  qsizetype length = 0;
  host::LineEnd end = host::LineEnd::None;
  int number = 0;
};

/// Splits a file into lines as the file layer does, refusing what it refuses: a NUL byte (not a text file)
/// and a line longer than the IDE allows. The quick way looks for line feeds only and leaves lone carriage
/// returns to the exact way (see crlfCount()); met with a problem, it stops and says so (gaveUp()) for the
/// exact way to report it with its line number.
class LineSplitter {
 public:
  LineSplitter(const QByteArray& bytes, const QString& path, bool exact)
      : m_data(bytes.constData()), m_size(bytes.size()), m_path(path), m_exact(exact) {
    m_nul = static_cast<const char*>(std::memchr(m_data, '\0', size_t(m_size)));
  }

  bool next(LineSpan& span) {
    if (m_position >= m_size || m_gaveUp) return false;
    const char* begin = m_data + m_position;
    const char* newline = static_cast<const char*>(std::memchr(begin, '\n', size_t(m_size - m_position)));
    const char* stop = newline ? newline : m_data + m_size;
    const char* cr = nullptr;
    if (m_exact) {
      cr = static_cast<const char*>(std::memchr(begin, '\r', size_t(stop - begin)));
    } else if (newline && newline > begin && newline[-1] == '\r') {
      cr = newline - 1;
      ++m_crlf;
    }
    span = LineSpan{m_position, (cr ? cr : stop) - begin, host::LineEnd::None, ++m_line};
    if (m_nul && m_nul < begin + span.length) return fail(QStringLiteral("not a text file"));
    if (span.length > host::kMaxLineLength)
      return fail(QStringLiteral("line longer than %1 characters").arg(host::kMaxLineLength));
    if (cr) {
      const bool crlf = cr + 1 < m_data + m_size && cr[1] == '\n';
      span.end = crlf ? host::LineEnd::CRLF : host::LineEnd::CR;
      m_position = (cr - m_data) + (crlf ? 2 : 1);
    } else if (newline) {
      span.end = host::LineEnd::LF;
      m_position = (newline - m_data) + 1;
    } else {
      m_position = m_size;
    }
    return true;
  }

  /// Carriage returns the quick way took as part of a CR LF: when the file holds others, it splits
  /// differently and must be read exactly.
  qsizetype crlfCount() const { return m_crlf; }
  /// The quick way met a problem: the file must be read exactly for it to be reported.
  bool gaveUp() const { return m_gaveUp; }
  bool exact() const { return m_exact; }

 private:
  bool fail(const QString& problem) {
    m_gaveUp = true;
    if (!m_exact) return false;
    throw ide::Error(ide::err::InvalidFileFormat,
                     QStringLiteral("%1, line %2: %3").arg(m_path).arg(m_line).arg(problem));
  }

  const char* m_data;
  qsizetype m_size;
  const QString& m_path;
  bool m_exact;
  const char* m_nul = nullptr;
  qsizetype m_position = 0;
  qsizetype m_crlf = 0;
  int m_line = 0;
  bool m_gaveUp = false;
};

/// The lines of a module file that reach the parser, with their line numbers in the file.
struct KeptLines {
  std::vector<host::SourceLine> lines;
  std::vector<int> fileLines;
  std::vector<bool> candidates;
  /// The carriage returns the split took as parts of CR LF line ends.
  qsizetype crlfCount = 0;
  /// The quick split stopped at a problem; the lines are incomplete.
  bool splitGaveUp = false;
  void add(QString text, host::LineEnd end, int fileLine, bool candidate) {
    lines.push_back({std::move(text), end});
    fileLines.push_back(fileLine);
    candidates.push_back(candidate);
  }
};

/// Whether a statement's first line may make the module's structure (a procedure header or end, a Type
/// or Enum block, a directive of conditional compilation) or is a hidden attribute line. Lines that are not
/// are never told apart from blank lines past the declarations section.
bool mayBeStructural(const char* text, qsizetype length) {
  const syntax::Kind kind = syntax::classify(QByteArrayView(text, length)).kind;
  return syntax::isStructural(kind) || kind == syntax::Kind::Attribute;
}

bool continuesBytes(const char* text, qsizetype length) {
  return syntax::continues(QByteArrayView(text, length));
}

bool isModuleAttribute(const char* text, qsizetype length) {
  return syntax::isModuleAttribute(QByteArrayView(text, length));
}

/// The lines of a module that decide where occurrences are: every line when the search uses wildcards
/// or the header is not recognised, else the header, the declarations section, the statements that may
/// open or close a procedure and the statements holding a candidate (continued statements whole).
KeptLines keptLines(const QByteArray& bytes, const QString& path, const Search& search, bool exact) {
  KeptLines kept;
  const char* data = bytes.constData();
  const auto decode = [&](const LineSpan& span) {
    return host::decodeAnsi(QByteArrayView(data + span.start, span.length));
  };
  LineSplitter splitter(bytes, path, exact);
  LineSpan span;
  if (!search.needle) {
    while (splitter.next(span))
      kept.add(decode(span), span.end, span.number, true);
    kept.crlfCount = splitter.crlfCount();
    kept.splitGaveUp = splitter.gaveUp();
    return kept;
  }

  // The header: up to the end of the first run of "Attribute VB_" lines, provided the parser reads
  // exactly those lines as the header.
  std::vector<LineSpan> start;
  bool inAttributes = false;
  while (splitter.next(span)) {
    start.push_back(span);
    const bool attribute = isModuleAttribute(data + span.start, span.length);
    if (inAttributes && !attribute) break;
    inAttributes = attribute;
  }
  size_t headerEnd = start.size();
  if (!start.empty() && !isModuleAttribute(data + start.back().start, start.back().length)) --headerEnd;
  for (size_t i = 0; i < headerEnd; ++i)
    kept.add(decode(start[i]), start[i].end, start[i].number, false);
  bool recognised = headerEnd > 0;
  if (recognised) {
    try {
      const host::ModuleSource header = host::parseModuleLines(kept.lines, path);
      recognised = header.code.empty() && header.memberAttributes.empty();
    } catch (const ide::Error&) {
      recognised = false;  // read whole, the file gives its own error
    }
  }
  if (!recognised) {
    KeptLines whole;
    LineSplitter again(bytes, path, exact);
    while (again.next(span))
      whole.add(decode(span), span.end, span.number, true);
    whole.crlfCount = again.crlfCount();
    whole.splitGaveUp = again.gaveUp();
    return whole;
  }

  qsizetype candidate =
      headerEnd < start.size() ? search.needle->indexIn(data, bytes.size(), start[headerEnd].start) : -1;
  bool declarations = true;  // every statement up to the first procedure header is kept
  std::vector<LineSpan> statement;
  std::vector<bool> statementCandidates;
  bool structural = false;
  bool anyCandidate = false;
  const auto keep = [&](const LineSpan& line, bool holdsCandidate, bool first) {
    QString text = decode(line);
    if (first && declarations && syntax::classify(text).kind == syntax::Kind::ProcHeader)
      declarations = false;
    kept.add(std::move(text), line.end, line.number, holdsCandidate);
  };
  const auto take = [&](const LineSpan& line) {
    bool holdsCandidate = false;
    if (candidate >= 0 && candidate < line.start + line.length) {
      holdsCandidate = true;
      candidate = search.needle->indexIn(data, bytes.size(), line.start + line.length);
    }
    const bool continues = continuesBytes(data + line.start, line.length);
    if (statement.empty()) {
      structural = mayBeStructural(data + line.start, line.length);
      if (!continues) {  // a statement of one line, as nearly all are
        if (declarations || structural || holdsCandidate) keep(line, holdsCandidate, true);
        return;
      }
    }
    statement.push_back(line);
    statementCandidates.push_back(holdsCandidate);
    anyCandidate = anyCandidate || holdsCandidate;
    if (continues) return;
    if (declarations || structural || anyCandidate)
      for (size_t i = 0; i < statement.size(); ++i)
        keep(statement[i], statementCandidates[i], i == 0);
    statement.clear();
    statementCandidates.clear();
    anyCandidate = false;
  };
  for (size_t i = headerEnd; i < start.size(); ++i)
    take(start[i]);
  while (splitter.next(span))
    take(span);
  // A statement still continued at the end of the file.
  for (size_t i = 0; i < statement.size(); ++i)
    kept.add(decode(statement[i]), statement[i].end, statement[i].number, true);
  kept.crlfCount = splitter.crlfCount();
  kept.splitGaveUp = splitter.gaveUp();
  return kept;
}

/// How many bytes of `bytes` are `value`, eight at a time.
qsizetype countByte(QByteArrayView bytes, char value) {
  constexpr quint64 kLow7 = 0x7F7F7F7F7F7F7F7FULL;
  const quint64 pattern = 0x0101010101010101ULL * quint8(value);
  qsizetype count = 0;
  qsizetype i = 0;
  for (; i + 8 <= bytes.size(); i += 8) {
    quint64 word;
    std::memcpy(&word, bytes.data() + i, 8);
    const quint64 x = word ^ pattern;  // a zero byte where `value` was
    // 0x80 where a byte of x is zero; the bytes' low bits added up by one multiplication.
    const quint64 zeros = ~(((x & kLow7) + kLow7) | x | kLow7);
    count += qsizetype(((zeros >> 7) * 0x0101010101010101ULL) >> 56);
  }
  for (; i < bytes.size(); ++i)
    count += bytes[i] == value;
  return count;
}

KeptLines keptLines(const QByteArray& bytes, const QString& path, const Search& search) {
  KeptLines kept = keptLines(bytes, path, search, false);
  if (!kept.splitGaveUp && countByte(bytes, '\r') == kept.crlfCount) return kept;
  return keptLines(bytes, path, search, true);
}

/// The file's bytes in `buffer`, which keeps its memory from one file to the next.
const QByteArray& readInto(QByteArray& buffer, const QString& path) {
  QFile file(path);
  if (QFileInfo(path).isFile() && file.open(QIODevice::ReadOnly | QIODevice::Unbuffered)) {
    const qint64 size = file.size();
    buffer.resize(size);
    if (file.read(buffer.data(), size) == size) return buffer;
  }
  buffer = fileio::readFileBytes(path);  // which says what failed
  return buffer;
}

ScannedModule scanModule(const QString& path, const Search& search) {
  thread_local QByteArray buffer;
  const KeptLines kept = keptLines(readInto(buffer, path), path, search);
  const bool utf8 = host::sourceEncoding() == host::SourceEncoding::Ansi && host::looksLikeUtf8(buffer);

  host::ModuleSource source = host::parseModuleLines(kept.lines, path);
  ScannedModule result;
  result.looksLikeUtf8 = utf8;
  result.name = host::moduleName(source);
  if (result.name.isEmpty()) result.name = QFileInfo(path).completeBaseName();
  const size_t codeCount = source.code.size();
  const auto& attributes = source.memberAttributes;
  const size_t headerCount = kept.lines.size() - codeCount - attributes.size();
  host::CodeText code;
  code.load(std::move(source.code), attributes);

  // The kept lines after the header are code lines and hidden attribute lines, in file order; the
  // attributes are the ones the parser put after as many code lines as have been passed.
  size_t attribute = 0;
  size_t codeIndex = 0;
  for (size_t k = headerCount; k < kept.lines.size(); ++k) {
    if (attribute < attributes.size() && size_t(attributes[attribute].afterCodeLine) == codeIndex) {
      ++attribute;
      continue;
    }
    const int line = int(++codeIndex);
    if (!kept.candidates[k]) continue;
    const QString& text = code.line(line);
    for (qsizetype from = 0;;) {
      const auto match = search.matcher.findIn(text, from, text.size());
      if (!match) break;
      ide::ProcKind kind = ide::ProcKind::Proc;
      QString procedure = code.procOfLine(line, kind);
      // Every file line above this one is a header line, a hidden attribute line or a code line.
      const int codeLine = kept.fileLines[k] - int(headerCount) - int(attribute);
      result.occurrences.push_back({codeLine, kept.fileLines[k], int(match->first) + 1,
                                    procedure.isEmpty() ? walk::declarationsText() : procedure,
                                    syntax::trimmedView(text).toString()});
      from = match->first + 1;
    }
  }
  return result;
}

/// The module's rows, as they are printed: "path:line:column: text", or tab-separated (project, module,
/// procedure, line:column in the code module, text without tabs).
QByteArray formatRows(const ModuleEntry& module, const ScannedModule& scanned, bool tsv) {
  QString rows;
  for (const Occurrence& hit : scanned.occurrences) {
    if (tsv) {
      rows += module.project % u'\t' % scanned.name % u'\t' % hit.procedure % u'\t' %
              QString::number(hit.line) % u':' % QString::number(hit.column) % u'\t' %
              QString(hit.text).replace(u'\t', u' ') % u'\n';
    } else {
      rows += module.shownPath % u':' % QString::number(hit.fileLine) % u':' % QString::number(hit.column) %
              QLatin1StringView(": ") % hit.text % u'\n';
    }
  }
  return rows.toLocal8Bit();
}

/// The module's occurrences as JSON objects, each line named for what it counts.
void appendJson(QJsonArray& out, const ModuleEntry& module, const ScannedModule& scanned) {
  for (const Occurrence& hit : scanned.occurrences)
    out.append(QJsonObject{{QStringLiteral("path"), module.shownPath},
                           {QStringLiteral("project"), module.project},
                           {QStringLiteral("module"), scanned.name},
                           {QStringLiteral("procedure"), hit.procedure},
                           {QStringLiteral("file_line"), hit.fileLine},
                           {QStringLiteral("code_line"), hit.line},
                           {QStringLiteral("column"), hit.column},
                           {QStringLiteral("text"), hit.text}});
}

}  // namespace

int runFind(const FindCommandOptions& options) {
  if (options.text.isEmpty()) {
    printError(QStringLiteral("the search text is empty"));
    return kUsageError;
  }
  useEncoding(options.input);
  std::optional<Search> search;
  try {
    search.emplace(
        Search{host::FindMatcher(options.text, options.wholeWord, options.matchCase, options.pattern), {}});
  } catch (const ide::Error& error) {
    printError(QStringLiteral("not a valid pattern: %1 (%2)").arg(options.text, error.description()));
    return kUsageError;
  }
  // The quick scan compares code-page bytes; UTF-8 files are read whole.
  if (!options.pattern && !options.input.utf8) search->needle.emplace(options.text, options.matchCase);

  const auto files = expandInputs(options.input);
  if (!files) return kInputError;
  Inputs inputs;
  inputs.exclusions = options.input.exclusions;
  for (const QString& file : *files) {
    try {
      inputs.add(file);
    } catch (const ide::Error& error) {
      printError(namingFileOnce(file, error.description()));
      return kInputError;
    }
  }
  const std::vector<ModuleEntry>& modules = inputs.modules;
  std::vector<ScannedModule> scanned(modules.size());
  std::vector<std::exception_ptr> failures;
  fileio::parallelFor(
      modules.size(),
      [&](size_t i) {
        scanned[i] = scanModule(modules[i].path, *search);
        if (!options.json) scanned[i].rows = formatRows(modules[i], scanned[i], options.tsv);
      },
      failures);
  for (const std::exception_ptr& failure : failures) {
    if (!failure) continue;
    try {
      std::rethrow_exception(failure);
    } catch (const ide::Error& error) {
      printError(error.description());  // it names the file, and the line where there is one
      return kInputError;
    }
  }

  bool moduleFound = options.module.isEmpty();
  int rows = 0;
  QByteArray out;
  QJsonArray json;
  for (size_t i = 0; i < modules.size(); ++i) {
    if (!options.module.isEmpty()) {
      if (scanned[i].name.compare(options.module, Qt::CaseInsensitive) != 0) continue;
      moduleFound = true;
    }
    if (scanned[i].looksLikeUtf8) warnUtf8(modules[i].shownPath);
    if (options.json)
      appendJson(json, modules[i], scanned[i]);
    else
      out += scanned[i].rows;
    rows += int(scanned[i].occurrences.size());
  }
  if (!moduleFound) {
    printError(QStringLiteral("no module '%1' in the files given").arg(options.module));
    return kUsageError;
  }
  if (!options.quiet) {
    printBytes(options.json ? jsonText(QJsonDocument(json)) : out);
    std::fflush(stdout);
    // What the add-in's window says when a search ends, and what the run left out.
    printSummary(QStringLiteral("%1 %2 found%3")
                     .arg(rows)
                     .arg(rows == 1 ? QStringLiteral("occurrence") : QStringLiteral("occurrences"))
                     .arg(inputs.missing ? QStringLiteral(", %1 missing").arg(inputs.missing) : QString()));
  }
  return withMissingFiles(rows > 0 ? kSuccess : kNothingFound, inputs.missing > 0);
}

}  // namespace cli
