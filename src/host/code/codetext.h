// SPDX-License-Identifier: MIT
// The code-module engine: the lines a code window shows, the hidden member attributes that belong to them,
// and a structural index (procedure headers and ends, the declarations section, the members) that every
// edit keeps up to date. Queries never re-scan the module and an edit re-reads only the lines it touched
// (plus the one line below whose continuation status it may change).
//
// Procedure extents follow the IDE:
// - a procedure runs from its header (Sub, Function, Property Get/Let/Set) to its End line; a header
//   continued with " _" spans several physical lines;
// - a procedure starts at the line after the previous procedure's End line, so blank and comment lines
//   above a header belong to the procedure below them; the first procedure starts right after the
//   declarations section;
// - the last procedure also owns every line after its End line;
// - the declarations section ends with the last line of the last statement that is neither blank nor a
//   comment before the first header. In a module without procedures it ends with the last line that is not
//   blank (comments count: there is no procedure for them to belong to).
// - a header without an End line (code being typed) runs until the line above the next header.
//
// Numbers are 1-based; failures throw ide::Error with the IDE's numbers.
#pragma once

#include "host/files/modulefile.h"
#include "host/files/sourcelines.h"
#include "ide/types.h"
#include "ide/vbide.h"
#include "syntax/declarations.h"
#include "syntax/line.h"

#include <QString>
#include <QStringView>

#include <memory>
#include <optional>
#include <vector>

namespace host {

/// A procedure as the index knows it.
struct ProcInfo {
  QString name;
  ide::ProcKind kind = ide::ProcKind::Proc;
  bool isFunction = false;
  ide::Scope scope = ide::Scope::Public;
  bool isStatic = false;
  /// A Declare statement: listed as a method and answered by the procedure queries, but it stands in the
  /// declarations and is not one of procedures().
  bool isDeclare = false;
  int bodyLine = 0;   // the header's first line
  int headerEnd = 0;  // the header's last physical line (of its last alternative under #If ... #Else)
  bool hasAlternatives = false;
  int endLine = 0;  // the End line (for an unterminated header: the line above the next header)
};

/// A member of the module (one per property name, whatever accessors it has).
struct MemberInfo {
  QString name;
  ide::MemberType type = ide::MemberType::Method;
  ide::Scope scope = ide::Scope::Public;
  bool isStatic = false;
  int line = 0;  // the declaration line, or the first procedure line of the first accessor
};

class CodeText {
 public:
  /// Told after every edit: `removed` lines from `firstLine` on were replaced by `inserted` lines.
  class Listener {
   public:
    virtual ~Listener() = default;
    virtual void linesChanged(int firstLine, int removed, int inserted) = 0;
  };

  CodeText();
  ~CodeText();
  CodeText(const CodeText&) = delete;
  CodeText& operator=(const CodeText&) = delete;

  /// Replaces the whole content with lines read from a file and their hidden attribute lines.
  void load(std::vector<SourceLine> code, std::vector<MemberAttributeLine> attributes);
  /// The content as file lines, hidden attribute lines at their places (owner names brought up to date).
  void store(std::vector<SourceLine>& code, std::vector<MemberAttributeLine>& attributes);
  /// Gives back the memory that lines no longer there held.
  void shrinkToFit();

  int countOfLines() const { return static_cast<int>(m_lines.size()); }
  /// Line `n` (1 to countOfLines), unchecked.
  const QString& line(int n) const { return m_lines[static_cast<size_t>(n - 1)].text; }
  QString lines(int startLine, int count) const;
  int countOfDeclarationLines();

  void insertLines(int line, QStringView text);
  void deleteLines(int startLine, int count);
  void replaceLine(int line, QStringView text);
  /// The same; the line shares the string's data instead of copying it.
  void replaceLine(int line, const QString& text);
  void addFromString(QStringView text);

  /// The procedure (name case-insensitive; Proc finds a Sub or Function); nullptr when there is none.
  const ProcInfo* findProc(QStringView name, ide::ProcKind kind);
  /// Throw error 35 when the procedure does not exist.
  int procStartLine(QStringView name, ide::ProcKind kind);
  int procBodyLine(QStringView name, ide::ProcKind kind);
  int procCountLines(QStringView name, ide::ProcKind kind);
  QString procOfLine(int line, ide::ProcKind& kind);
  /// Every procedure in line order.
  const std::vector<ProcInfo>& procedures();
  /// Every procedure in line order with its extent, found by its place (not by its name).
  std::vector<ide::ProcExtent> procedureExtents();
  /// The extent of the procedure that holds `line`; nothing for a line of the declarations.
  std::optional<ide::ProcExtent> extentOfLine(int line);

  const std::vector<MemberInfo>& members();
  std::optional<MemberInfo> member(QStringView name);
  /// A member attribute such as VB_UserMemId or VB_Description: its value text as written, if the member
  /// has it.
  std::optional<QString> memberAttribute(QStringView member, QStringView attribute);
  /// Sets (or with an empty value removes) a member attribute; a new one is written after the member's
  /// declaration (for a property, after its Get header when it has one).
  void setMemberAttribute(QStringView member, QStringView attribute, const std::optional<QString>& valueText);

  bool find(QStringView target, int& startLine, int& startColumn, int& endLine, int& endColumn,
            bool wholeWord, bool matchCase, bool patternSearch) const;

  /// Grows with every edit.
  quint64 changeCount() const { return m_changeCount; }

  void addListener(Listener* listener);
  void removeListener(Listener* listener);

 private:
  struct Attributes {
    std::vector<SourceLine> lines;
    /// The procedure the line's header declared when they were attached: attributes of that owner are
    /// renamed with the procedure; those naming another member are written as they stand.
    QString owner;
  };
  struct Line {
    QString text;
    LineEnd end = LineEnd::CRLF;
    syntax::Kind kind = syntax::Kind::Blank;
    bool continues = false;
    /// Hidden attribute lines written after this line (rare, hence the indirection).
    std::unique_ptr<Attributes> attributes;
  };
  struct Index;

  Line makeLine(QStringView text, bool isContinuation, LineEnd end) const;
  void replaceLine(int line, QStringView text, const QString* shared);
  void reclassifyFrom(size_t index);
  void insertMarkers(int firstLine, int count);
  void shiftMarkers(int fromLine, int delta);
  void updateMarker(int lineNumber, bool wasStructural, bool isNowStructural);
  void touch(int firstLine, int removed, int inserted, bool structural);
  bool shiftIndex(int firstLine, int removed, int inserted);
  Index& index();
  void rebuildIndex();
  void attach(int lineNumber, SourceLine attribute);
  /// Line `lineNumber` continues a statement that makes the module's structure (a header).
  bool continuesStructural(int lineNumber) const;
  /// The name a header declares when `lineNumber` is one of its lines, else empty.
  QString headerNameAt(int lineNumber) const;
  /// The procedure that holds `line` (checked), or none for a line of the declarations.
  const ProcInfo* owner(int line);
  /// The first and last line of the extent of procedure `i` of the index.
  int startLineOf(size_t i) const;
  int lastLineOf(size_t i) const;
  /// Procedure `i` of the index with its extent.
  ide::ProcExtent extentAt(size_t i) const;
  QString statementText(int firstLine, int lastLine) const;
  int statementEnd(int firstLine) const;
  int memberAnchorLine(QStringView member);
  std::vector<std::pair<int, int>> memberLineRanges(QStringView member);
  SourceLine* findMemberAttribute(QStringView member, QStringView attribute, Line** owner);
  LineEnd newLineEnd() const;
  void checkLineNumber(int line, int last) const;

  std::vector<Line> m_lines;
  /// Lines holding a procedure header or End statement, or the first or End line of a Type or Enum
  /// block, ascending: the structure's skeleton.
  std::vector<int> m_markers;
  std::unique_ptr<Index> m_index;  // derived from the markers; rebuilt lazily after structural edits
  bool m_indexValid = false;
  /// The first header line at the last rebuild; edits above it change the declarations section.
  int m_firstHeaderLine = 0;
  /// Attribute lines whose line was deleted, kept until a member of their owner's name takes them back.
  std::vector<SourceLine> m_orphanAttributes;
  /// Attribute lines above the first code line, written back where they were.
  std::vector<SourceLine> m_leadingAttributes;
  quint64 m_changeCount = 0;
  /// Grows whenever a line becomes or stops being a header or End line.
  quint64 m_markerEdits = 0;
  std::vector<Listener*> m_listeners;
};

}  // namespace host
