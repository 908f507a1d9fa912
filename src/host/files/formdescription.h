// SPDX-License-Identifier: MIT
// The form description at the top of a .frm, .ctl, .pag, .dob or .dsr file: the nested "Begin <Class>
// <Name>" ... "End" blocks of the root object and its controls, their property lines and their
// "BeginProperty" ... "EndProperty" groups. Every line is kept as it was read, so an unchanged description
// is written back byte for byte; an edit regenerates only the lines it touches, in the IDE's layout.
#pragma once

#include "host/files/sourcelines.h"

#include <QString>
#include <QStringList>
#include <QStringView>

#include <cstddef>
#include <functional>
#include <memory>
#include <optional>
#include <variant>
#include <vector>

namespace host {

class FormNode;
class PropertyBlock;

/// The width the IDE pads a property name to before the "=".
inline constexpr int kPropertyNameWidth = 16;

/// The text of a property line in the IDE's layout: `indent`, the name padded to kPropertyNameWidth,
/// "=   ", the value and, when there is one, the comment (which starts with the apostrophe).
QString composePropertyLine(QStringView indent, QStringView name, QStringView valueText, QStringView comment);

/// What Begin ... End and BeginProperty ... EndProperty blocks have in common: a begin line, property
/// lines and nested property blocks, an end line. Property names compare case-insensitively.
class PropertyGroup {
 public:
  PropertyGroup(const PropertyGroup&) = delete;
  PropertyGroup& operator=(const PropertyGroup&) = delete;

  /// The names of the property lines in file order (property blocks are listed by propertyBlocks()).
  QStringList propertyNames() const;

  /// The value as written, without the trailing comment: `"Form1"`, `-1`, `&H8000000F&`,
  /// `"Form1.frx":0000`; nothing when the line is absent.
  std::optional<QString> property(QStringView name) const;

  /// The comment after the value (`'True`, `'CenterScreen`), or an empty text.
  QString propertyComment(QStringView name) const;

  /// Replaces the property's line, or inserts a new line at its alphabetical place among the group's
  /// properties. A line whose value and comment already match is left alone. `comment` includes its
  /// apostrophe. Throws ide::Error 5 for a name that cannot be written (empty, blanks, "=").
  void setProperty(const QString& name, const QString& valueText, const QString& comment = {});

  /// Rewrites the value of the `occurrence`-th line named `name` (0: the one property() reads), keeping its
  /// comment; without such a line, as setProperty. A damaged file may hold a property twice: each line
  /// keeps its own value.
  void setPropertyAt(const QString& name, int occurrence, const QString& valueText);

  /// Removes the property's line; false when there is none.
  bool removeProperty(QStringView name);

  /// The BeginProperty blocks directly inside this group, in file order.
  std::vector<PropertyBlock*> propertyBlocks() const;
  PropertyBlock* propertyBlock(QStringView name) const;

  /// Adds an empty "BeginProperty <name> [<guid>]" block at its alphabetical place among the properties.
  PropertyBlock& addPropertyBlock(const QString& name, const QString& guid = {});
  bool removePropertyBlock(QStringView name);

  /// The leading blanks of the group's begin line.
  QString indent() const;

  /// Calls `visit` for every property line of the group, of its property blocks and of the controls inside
  /// it, in file order, with the group holding the line and the control that group belongs to.
  using PropertyVisitor =
      std::function<void(PropertyGroup& group, FormNode& owner, QStringView name, QStringView value)>;

 protected:
  struct PropertyLine {
    SourceLine line;
    qsizetype nameStart = 0;
    qsizetype nameLength = 0;
    qsizetype valueStart = 0;
    qsizetype valueLength = 0;
    qsizetype commentStart = -1;  // -1: no comment

    QStringView name() const { return QStringView(line.text).mid(nameStart, nameLength); }
    QStringView value() const { return QStringView(line.text).mid(valueStart, valueLength); }
    QStringView comment() const;
  };
  /// A line inside a group that carries nothing (blank); kept so that it is written back.
  struct OtherLine {
    SourceLine line;
  };
  using Item =
      std::variant<PropertyLine, std::unique_ptr<PropertyBlock>, std::unique_ptr<FormNode>, OtherLine>;

  PropertyGroup(SourceLine beginLine, SourceLine endLine);
  ~PropertyGroup();

  /// Parses a property line; nothing when the text is not `Name = value`.
  static std::optional<PropertyLine> parsePropertyLine(SourceLine line);

  QString bodyIndent() const { return indent() + QStringLiteral("   "); }
  /// Generated lines end like the group's begin line.
  LineEnd generatedLineEnd() const { return m_beginLine.end; }

  const PropertyLine* findProperty(QStringView name) const;
  PropertyLine* findProperty(QStringView name, int occurrence);
  void writeProperty(PropertyLine* existing, const QString& name, const QString& valueText,
                     const QString& fullComment);
  /// Where a property or block named `name` goes: before the first property or block whose name sorts
  /// after it, else after the last one (so before any child control).
  std::size_t insertionPosition(QStringView name) const;

  void appendBodyLines(std::vector<SourceLine>& out) const;
  void visitProperties(FormNode& owner, const PropertyVisitor& visit);
  void copyBody(const PropertyGroup& from, FormNode* owner);
  /// Replaces the indentation `from` at the start of every line of the group by `to`.
  void reindent(const QString& from, const QString& to);

  SourceLine m_beginLine;
  SourceLine m_endLine;
  std::vector<Item> m_items;

  friend class FormParser;
  friend class FormNode;
};

/// A "BeginProperty <Name> [{GUID}]" ... "EndProperty" block, such as a control's Font.
class PropertyBlock final : public PropertyGroup {
 public:
  QString name() const;
  /// The "{GUID}" after the name, or an empty text.
  QString guid() const;
  void appendLines(std::vector<SourceLine>& out) const;

 private:
  PropertyBlock(SourceLine beginLine, SourceLine endLine);
  static std::unique_ptr<PropertyBlock> create(SourceLine beginLine, SourceLine endLine);
  std::unique_ptr<PropertyBlock> clone() const;

  friend class FormParser;
  friend class PropertyGroup;
  friend class FormNode;
};

/// A "Begin <Class> <Name>" ... "End" block: the form (or user control, property page ...) or a control.
class FormNode final : public PropertyGroup {
 public:
  /// As written: "VB.Form", "VB.TextBox", "MSComctlLib.ListView", "{C0E45035-...}".
  const QString& className() const { return m_className; }
  QString name() const;
  /// Rewrites the name on the Begin line; the rest of the line is kept.
  void setName(const QString& name);

  /// The Index line's value (a control array element), or -1 without one.
  int index() const;
  /// Writes the Index line; -1 removes it.
  void setIndex(int index);

  FormNode* parent() const { return m_parent; }
  const std::vector<FormNode*>& children() const { return m_children; }

  /// A new empty control block as the IDE writes it ("Begin VB.TextBox Text1 " and "End"), at `position`
  /// among the children (-1 or past the end appends).
  FormNode& addChild(const QString& className, const QString& name, int position = -1);

  /// Removes a child with its whole block; nothing when `child` is not a child of this node.
  std::unique_ptr<FormNode> takeChild(const FormNode& child);

  /// Inserts a block taken from elsewhere at `position` among the children, re-indenting its lines.
  FormNode& insertChild(std::unique_ptr<FormNode> child, int position = -1);

  /// Visits the property lines of this control and everything inside it (see PropertyVisitor).
  void forEachProperty(const PropertyVisitor& visit) { visitProperties(*this, visit); }

  /// The first node of this subtree (this one included) with the name, and the index unless it is -1.
  FormNode* findNode(QStringView name, int index = -1);
  const FormNode* findNode(QStringView name, int index = -1) const;

  void appendLines(std::vector<SourceLine>& out) const;

 private:
  FormNode(SourceLine beginLine, SourceLine endLine, QString className, qsizetype nameStart,
           qsizetype nameLength);
  std::unique_ptr<FormNode> clone(FormNode* parent) const;
  std::size_t itemPositionForChild(int position) const;
  void rebuildChildren();

  QString m_className;
  qsizetype m_nameStart;
  qsizetype m_nameLength;
  FormNode* m_parent = nullptr;
  std::vector<FormNode*> m_children;

  friend class FormParser;
  friend class PropertyGroup;
  friend class FormDescription;
};

/// A whole form description with its root node. Copies are deep.
class FormDescription {
 public:
  /// A description with an empty root block, for a new component.
  FormDescription(const QString& className, const QString& name, LineEnd lineEnd = LineEnd::CRLF);
  FormDescription(const FormDescription& other);
  FormDescription& operator=(const FormDescription& other);
  FormDescription(FormDescription&&) noexcept;
  FormDescription& operator=(FormDescription&&) noexcept;
  ~FormDescription();

  /// Parses the block that starts at lines[position] (its Begin line) through its matching End, and moves
  /// `position` past the End line. `lines` is the whole file, so position + 1 is the line number that
  /// errors report: ide::Error 321 "<fileName>, line <n>: ..." for a block without its End, a property
  /// group without its EndProperty, or a line that is none of Begin, End, BeginProperty, EndProperty,
  /// "Name = value" or blank.
  /// `lines` gives line `index` of the file, or null past its end.
  using Lines = std::function<const SourceLine*(std::size_t index)>;
  static FormDescription parse(const Lines& lines, std::size_t& position, const QString& fileName);
  static FormDescription parse(const std::vector<SourceLine>& lines, std::size_t& position,
                               const QString& fileName);

  FormNode& root() { return *m_root; }
  const FormNode& root() const { return *m_root; }

  /// Appends the lines of the description, unchanged lines exactly as read.
  void appendLines(std::vector<SourceLine>& out) const;

 private:
  explicit FormDescription(std::unique_ptr<FormNode> root);
  std::unique_ptr<FormNode> m_root;
};

}  // namespace host
