// SPDX-License-Identifier: MIT
// Form descriptions: a recursive-descent reader that looks at each line once, and the edits that keep every
// untouched line as it was read.
#include "host/files/formdescription.h"
#include "syntax/text.h"

#include "ide/error.h"

#include <algorithm>
#include <utility>

namespace host {
namespace {

// Deeper nesting than any designer produces; the limit keeps a damaged file from exhausting the stack.
constexpr int kMaxNesting = 200;

qsizetype wordEnd(QStringView text, qsizetype from) {
  while (from < text.size() && !syntax::isBlank(text[from]))
    ++from;
  return from;
}

bool isBlankFrom(QStringView text, qsizetype from) {
  return syntax::skipBlanks(text, from) == text.size();
}

/// The `number`-th blank-separated word of `text` (0 = the first), with its start; empty when absent.
QStringView wordAt(QStringView text, int number, qsizetype* start = nullptr) {
  qsizetype begin = syntax::skipBlanks(text, 0);
  for (int i = 0; i < number && begin < text.size(); ++i)
    begin = syntax::skipBlanks(text, wordEnd(text, begin));
  if (start) *start = begin;
  return text.mid(begin, wordEnd(text, begin) - begin);
}

enum class LineKind { Blank, Begin, End, BeginProperty, EndProperty, Other };

LineKind classifyLine(QStringView text) {
  const qsizetype start = syntax::skipBlanks(text, 0);
  if (start == text.size()) return LineKind::Blank;
  const qsizetype end = wordEnd(text, start);
  const QStringView word = text.mid(start, end - start);
  if (word.compare(u"Begin", Qt::CaseInsensitive) == 0) return LineKind::Begin;
  if (word.compare(u"BeginProperty", Qt::CaseInsensitive) == 0) return LineKind::BeginProperty;
  if (word.compare(u"End", Qt::CaseInsensitive) == 0 && isBlankFrom(text, end)) return LineKind::End;
  if (word.compare(u"EndProperty", Qt::CaseInsensitive) == 0 && isBlankFrom(text, end)) {
    return LineKind::EndProperty;
  }
  return LineKind::Other;
}

bool isWritablePropertyName(QStringView name) {
  if (name.isEmpty()) return false;
  return std::none_of(name.begin(), name.end(), [](QChar character) {
    return syntax::isBlank(character) || character == u'=' || character == u'"' || character == u'\'' ||
           character == u'\r' || character == u'\n';
  });
}

QString leadingBlanks(const QString& text) {
  return text.left(syntax::skipBlanks(text, 0));
}

}  // namespace

QString composePropertyLine(QStringView indent, QStringView name, QStringView valueText,
                            QStringView comment) {
  // Saved files pad what follows an "Object." prefix ("Object.Width           =   2540").
  qsizetype width = kPropertyNameWidth;
  if (name.startsWith(u"Object.", Qt::CaseInsensitive)) width += 7;
  QString text;
  text.reserve(indent.size() + std::max(width, name.size()) + 4 + valueText.size() + 3 + comment.size());
  text.append(indent).append(name);
  if (name.size() < width) text.append(QString(width - name.size(), u' '));
  text.append(u"=   ").append(valueText);
  if (!comment.isEmpty()) {
    // The IDE gives a Boolean's value the width of "-1": "0   'False" beside "-1  'True".
    if (valueText.size() == 1 && (comment == u"'False" || comment == u"'True")) text.append(u' ');
    text.append(u"  ").append(comment);
  }
  return text;
}

// --- PropertyGroup ---------------------------------------------------------------------------------------

QStringView PropertyGroup::PropertyLine::comment() const {
  if (commentStart < 0) return {};
  QStringView rest = QStringView(line.text).mid(commentStart);
  while (!rest.isEmpty() && syntax::isBlank(rest.back()))
    rest.chop(1);
  return rest;
}

PropertyGroup::PropertyGroup(SourceLine beginLine, SourceLine endLine)
    : m_beginLine(std::move(beginLine)), m_endLine(std::move(endLine)) {}

PropertyGroup::~PropertyGroup() = default;

std::optional<PropertyGroup::PropertyLine> PropertyGroup::parsePropertyLine(SourceLine line) {
  const QStringView text(line.text);
  const qsizetype nameStart = syntax::skipBlanks(text, 0);
  const qsizetype equals = text.indexOf(u'=', nameStart);
  if (equals < 0) return std::nullopt;
  qsizetype nameEnd = equals;
  while (nameEnd > nameStart && syntax::isBlank(text[nameEnd - 1]))
    --nameEnd;
  const QStringView name = text.mid(nameStart, nameEnd - nameStart);
  if (!isWritablePropertyName(name)) return std::nullopt;

  const qsizetype valueStart = syntax::skipBlanks(text, equals + 1);
  // An apostrophe starts the comment unless it is inside a quoted string ("Don't"); doubled quotes
  // inside a string toggle twice and so need no special case.
  qsizetype commentStart = -1;
  bool inQuotes = false;
  for (qsizetype i = valueStart; i < text.size(); ++i) {
    const QChar character = text[i];
    if (character == u'"') {
      inQuotes = !inQuotes;
    } else if (character == u'\'' && !inQuotes) {
      commentStart = i;
      break;
    }
  }
  qsizetype valueEnd = commentStart < 0 ? text.size() : commentStart;
  while (valueEnd > valueStart && syntax::isBlank(text[valueEnd - 1]))
    --valueEnd;

  PropertyLine property;
  property.nameStart = nameStart;
  property.nameLength = nameEnd - nameStart;
  property.valueStart = valueStart;
  property.valueLength = valueEnd - valueStart;
  property.commentStart = commentStart;
  property.line = std::move(line);
  return property;
}

QString PropertyGroup::indent() const {
  return leadingBlanks(m_beginLine.text);
}

const PropertyGroup::PropertyLine* PropertyGroup::findProperty(QStringView name) const {
  for (const Item& item : m_items) {
    if (const auto* property = std::get_if<PropertyLine>(&item)) {
      if (property->name().compare(name, Qt::CaseInsensitive) == 0) return property;
    }
  }
  return nullptr;
}

QStringList PropertyGroup::propertyNames() const {
  QStringList names;
  for (const Item& item : m_items) {
    if (const auto* property = std::get_if<PropertyLine>(&item)) names.append(property->name().toString());
  }
  return names;
}

std::optional<QString> PropertyGroup::property(QStringView name) const {
  const PropertyLine* property = findProperty(name);
  if (!property) return std::nullopt;
  return property->value().toString();
}

QString PropertyGroup::propertyComment(QStringView name) const {
  const PropertyLine* property = findProperty(name);
  return property ? property->comment().toString() : QString();
}

std::size_t PropertyGroup::insertionPosition(QStringView name) const {
  std::size_t afterLast = 0;
  for (std::size_t i = 0; i < m_items.size(); ++i) {
    const Item& item = m_items[i];
    QString blockName;
    QStringView itemName;
    if (const auto* property = std::get_if<PropertyLine>(&item)) {
      itemName = property->name();
    } else if (const auto* block = std::get_if<std::unique_ptr<PropertyBlock>>(&item)) {
      blockName = (*block)->name();
      itemName = blockName;
    } else if (std::holds_alternative<std::unique_ptr<FormNode>>(item)) {
      break;  // controls follow all properties
    } else {
      continue;
    }
    if (itemName.compare(name, Qt::CaseInsensitive) > 0) return i;
    afterLast = i + 1;
  }
  return afterLast;
}

void PropertyGroup::setProperty(const QString& name, const QString& valueText, const QString& comment) {
  if (!isWritablePropertyName(name)) {
    throw ide::Error(ide::err::InvalidProcedureCall,
                     QStringLiteral("Invalid property name \"%1\"").arg(name));
  }
  QString fullComment = comment;
  if (!fullComment.isEmpty() && !fullComment.startsWith(u'\'')) fullComment.prepend(u'\'');

  writeProperty(findProperty(name, 0), name, valueText, fullComment);
}

void PropertyGroup::setPropertyAt(const QString& name, int occurrence, const QString& valueText) {
  PropertyLine* existing = findProperty(name, occurrence);
  if (!existing) return setProperty(name, valueText);
  writeProperty(existing, name, valueText, existing->comment().toString());
}

PropertyGroup::PropertyLine* PropertyGroup::findProperty(QStringView name, int occurrence) {
  for (Item& item : m_items) {
    auto* property = std::get_if<PropertyLine>(&item);
    if (property && property->name().compare(name, Qt::CaseInsensitive) == 0 && occurrence-- == 0)
      return property;
  }
  return nullptr;
}

void PropertyGroup::writeProperty(PropertyLine* existing, const QString& name, const QString& valueText,
                                  const QString& fullComment) {
  if (existing && existing->value() == valueText && existing->comment() == fullComment) return;

  SourceLine line;
  if (existing) {
    // Keep the spelling of the name and the indentation and line end the file already has.
    line.text =
        composePropertyLine(leadingBlanks(existing->line.text), existing->name(), valueText, fullComment);
    line.end = existing->line.end;
  } else {
    line.text = composePropertyLine(bodyIndent(), name, valueText, fullComment);
    line.end = generatedLineEnd();
  }
  // A value that would not read back as itself (a line break, an unbalanced quote swallowing the comment)
  // would corrupt the file.
  std::optional<PropertyLine> parsed = parsePropertyLine(std::move(line));
  if (!parsed || parsed->value() != valueText || parsed->comment() != fullComment ||
      valueText.contains(u'\n') || valueText.contains(u'\r') || fullComment.contains(u'\n') ||
      fullComment.contains(u'\r')) {
    throw ide::Error(ide::err::InvalidProcedureCall,
                     QStringLiteral("The value %1 of property %2 cannot be written in a form description")
                         .arg(valueText, name));
  }
  if (existing) {
    *existing = std::move(*parsed);
  } else {
    m_items.insert(m_items.begin() + static_cast<std::ptrdiff_t>(insertionPosition(name)),
                   std::move(*parsed));
  }
}

bool PropertyGroup::removeProperty(QStringView name) {
  auto found = std::find_if(m_items.begin(), m_items.end(), [&](const Item& item) {
    const auto* property = std::get_if<PropertyLine>(&item);
    return property && property->name().compare(name, Qt::CaseInsensitive) == 0;
  });
  if (found == m_items.end()) return false;
  m_items.erase(found);
  return true;
}

std::vector<PropertyBlock*> PropertyGroup::propertyBlocks() const {
  std::vector<PropertyBlock*> blocks;
  for (const Item& item : m_items) {
    if (const auto* block = std::get_if<std::unique_ptr<PropertyBlock>>(&item))
      blocks.push_back(block->get());
  }
  return blocks;
}

PropertyBlock* PropertyGroup::propertyBlock(QStringView name) const {
  for (const Item& item : m_items) {
    if (const auto* block = std::get_if<std::unique_ptr<PropertyBlock>>(&item)) {
      if ((*block)->name().compare(name, Qt::CaseInsensitive) == 0) return block->get();
    }
  }
  return nullptr;
}

PropertyBlock& PropertyGroup::addPropertyBlock(const QString& name, const QString& guid) {
  if (!isWritablePropertyName(name) || guid.contains(u' ') || guid.contains(u'\t')) {
    throw ide::Error(ide::err::InvalidProcedureCall,
                     QStringLiteral("Invalid property block name \"%1\"").arg(name));
  }
  const QString indent = bodyIndent();
  // The IDE ends a BeginProperty line with a blank, as it does a Begin line.
  QString beginText = indent + QStringLiteral("BeginProperty ") + name + u' ';
  if (!guid.isEmpty()) beginText.append(guid).append(u' ');
  auto block = PropertyBlock::create(SourceLine{beginText, generatedLineEnd()},
                                     SourceLine{indent + QStringLiteral("EndProperty"), generatedLineEnd()});
  PropertyBlock& result = *block;
  m_items.insert(m_items.begin() + static_cast<std::ptrdiff_t>(insertionPosition(name)), std::move(block));
  return result;
}

bool PropertyGroup::removePropertyBlock(QStringView name) {
  auto found = std::find_if(m_items.begin(), m_items.end(), [&](const Item& item) {
    const auto* block = std::get_if<std::unique_ptr<PropertyBlock>>(&item);
    return block && (*block)->name().compare(name, Qt::CaseInsensitive) == 0;
  });
  if (found == m_items.end()) return false;
  m_items.erase(found);
  return true;
}

void PropertyGroup::appendBodyLines(std::vector<SourceLine>& out) const {
  for (const Item& item : m_items) {
    if (const auto* property = std::get_if<PropertyLine>(&item)) {
      out.push_back(property->line);
    } else if (const auto* block = std::get_if<std::unique_ptr<PropertyBlock>>(&item)) {
      (*block)->appendLines(out);
    } else if (const auto* child = std::get_if<std::unique_ptr<FormNode>>(&item)) {
      (*child)->appendLines(out);
    } else {
      out.push_back(std::get<OtherLine>(item).line);
    }
  }
}

void PropertyGroup::visitProperties(FormNode& owner, const PropertyVisitor& visit) {
  for (Item& item : m_items) {
    if (const auto* property = std::get_if<PropertyLine>(&item)) {
      visit(*this, owner, property->name(), property->value());
    } else if (auto* block = std::get_if<std::unique_ptr<PropertyBlock>>(&item)) {
      (*block)->visitProperties(owner, visit);
    } else if (auto* child = std::get_if<std::unique_ptr<FormNode>>(&item)) {
      (*child)->visitProperties(**child, visit);
    }
  }
}

void PropertyGroup::copyBody(const PropertyGroup& from, FormNode* owner) {
  m_items.reserve(from.m_items.size());
  for (const Item& item : from.m_items) {
    if (const auto* property = std::get_if<PropertyLine>(&item)) {
      m_items.emplace_back(*property);
    } else if (const auto* block = std::get_if<std::unique_ptr<PropertyBlock>>(&item)) {
      m_items.emplace_back((*block)->clone());
    } else if (const auto* child = std::get_if<std::unique_ptr<FormNode>>(&item)) {
      m_items.emplace_back((*child)->clone(owner));
    } else {
      m_items.emplace_back(std::get<OtherLine>(item));
    }
  }
}

namespace {

qsizetype replaceIndent(SourceLine& line, const QString& from, const QString& to) {
  if (!line.text.startsWith(from)) return 0;
  line.text.replace(0, from.size(), to);
  return to.size() - from.size();
}

}  // namespace

void PropertyGroup::reindent(const QString& from, const QString& to) {
  replaceIndent(m_beginLine, from, to);
  replaceIndent(m_endLine, from, to);
  for (Item& item : m_items) {
    if (auto* property = std::get_if<PropertyLine>(&item)) {
      const qsizetype shift = replaceIndent(property->line, from, to);
      property->nameStart += shift;
      property->valueStart += shift;
      if (property->commentStart >= 0) property->commentStart += shift;
    } else if (auto* block = std::get_if<std::unique_ptr<PropertyBlock>>(&item)) {
      (*block)->reindent(from, to);
    } else if (auto* child = std::get_if<std::unique_ptr<FormNode>>(&item)) {
      const qsizetype shift = (*child)->m_beginLine.text.startsWith(from) ? to.size() - from.size() : 0;
      (*child)->reindent(from, to);
      (*child)->m_nameStart += shift;
    } else {
      replaceIndent(std::get<OtherLine>(item).line, from, to);
    }
  }
}

// --- PropertyBlock ---------------------------------------------------------------------------------------

PropertyBlock::PropertyBlock(SourceLine beginLine, SourceLine endLine)
    : PropertyGroup(std::move(beginLine), std::move(endLine)) {}

std::unique_ptr<PropertyBlock> PropertyBlock::create(SourceLine beginLine, SourceLine endLine) {
  return std::unique_ptr<PropertyBlock>(new PropertyBlock(std::move(beginLine), std::move(endLine)));
}

QString PropertyBlock::name() const {
  return wordAt(m_beginLine.text, 1).toString();
}

QString PropertyBlock::guid() const {
  const QStringView word = wordAt(m_beginLine.text, 2);
  return word.startsWith(u'{') ? word.toString() : QString();
}

void PropertyBlock::appendLines(std::vector<SourceLine>& out) const {
  out.push_back(m_beginLine);
  appendBodyLines(out);
  out.push_back(m_endLine);
}

std::unique_ptr<PropertyBlock> PropertyBlock::clone() const {
  auto copy = create(m_beginLine, m_endLine);
  copy->copyBody(*this, nullptr);
  return copy;
}

// --- FormNode --------------------------------------------------------------------------------------------

FormNode::FormNode(SourceLine beginLine, SourceLine endLine, QString className, qsizetype nameStart,
                   qsizetype nameLength)
    : PropertyGroup(std::move(beginLine), std::move(endLine)),
      m_className(std::move(className)),
      m_nameStart(nameStart),
      m_nameLength(nameLength) {}

QString FormNode::name() const {
  return m_beginLine.text.mid(m_nameStart, m_nameLength);
}

void FormNode::setName(const QString& name) {
  if (!isWritablePropertyName(name)) {
    throw ide::Error(ide::err::InvalidProcedureCall, QStringLiteral("Invalid control name \"%1\"").arg(name));
  }
  m_beginLine.text.replace(m_nameStart, m_nameLength, name);
  m_nameLength = name.size();
}

int FormNode::index() const {
  const std::optional<QString> text = property(u"Index");
  if (!text) return -1;
  bool valid = false;
  const int value = text->toInt(&valid);
  return valid ? value : -1;
}

void FormNode::setIndex(int index) {
  if (index < 0) {
    removeProperty(u"Index");
  } else {
    setProperty(QStringLiteral("Index"), QString::number(index));
  }
}

void FormNode::rebuildChildren() {
  m_children.clear();
  for (const Item& item : m_items) {
    if (const auto* child = std::get_if<std::unique_ptr<FormNode>>(&item)) m_children.push_back(child->get());
  }
}

std::size_t FormNode::itemPositionForChild(int position) const {
  const FormNode* before = position >= 0 && static_cast<std::size_t>(position) < m_children.size()
                               ? m_children[position]
                               : nullptr;
  if (before) {
    for (std::size_t i = 0; i < m_items.size(); ++i) {
      const auto* child = std::get_if<std::unique_ptr<FormNode>>(&m_items[i]);
      if (child && child->get() == before) return i;
    }
  }
  return m_items.size();
}

FormNode& FormNode::addChild(const QString& className, const QString& name, int position) {
  if (!isWritablePropertyName(className) || !isWritablePropertyName(name)) {
    throw ide::Error(ide::err::InvalidProcedureCall,
                     QStringLiteral("Invalid control class or name \"%1 %2\"").arg(className, name));
  }
  const QString indent = bodyIndent();
  const QString prefix = indent + QStringLiteral("Begin ") + className + u' ';
  // The IDE ends every Begin line with a blank after the name.
  SourceLine begin{prefix + name + u' ', generatedLineEnd()};
  SourceLine end{indent + QStringLiteral("End"), generatedLineEnd()};
  std::unique_ptr<FormNode> child(
      new FormNode(std::move(begin), std::move(end), className, prefix.size(), name.size()));
  child->m_parent = this;
  FormNode& result = *child;
  m_items.insert(m_items.begin() + static_cast<std::ptrdiff_t>(itemPositionForChild(position)),
                 std::move(child));
  rebuildChildren();
  return result;
}

std::unique_ptr<FormNode> FormNode::takeChild(const FormNode& child) {
  for (auto it = m_items.begin(); it != m_items.end(); ++it) {
    auto* owned = std::get_if<std::unique_ptr<FormNode>>(&*it);
    if (owned && owned->get() == &child) {
      std::unique_ptr<FormNode> taken = std::move(*owned);
      m_items.erase(it);
      rebuildChildren();
      taken->m_parent = nullptr;
      return taken;
    }
  }
  return nullptr;
}

FormNode& FormNode::insertChild(std::unique_ptr<FormNode> child, int position) {
  const QString from = child->indent();
  const QString to = bodyIndent();
  if (from != to) {
    child->reindent(from, to);
    child->m_nameStart += to.size() - from.size();
  }
  child->m_parent = this;
  FormNode& result = *child;
  m_items.insert(m_items.begin() + static_cast<std::ptrdiff_t>(itemPositionForChild(position)),
                 std::move(child));
  rebuildChildren();
  return result;
}

const FormNode* FormNode::findNode(QStringView name, int index) const {
  if (this->name().compare(name, Qt::CaseInsensitive) == 0 && (index < 0 || this->index() == index))
    return this;
  for (const FormNode* child : m_children) {
    if (const FormNode* found = child->findNode(name, index)) return found;
  }
  return nullptr;
}

FormNode* FormNode::findNode(QStringView name, int index) {
  return const_cast<FormNode*>(std::as_const(*this).findNode(name, index));
}

void FormNode::appendLines(std::vector<SourceLine>& out) const {
  out.push_back(m_beginLine);
  appendBodyLines(out);
  out.push_back(m_endLine);
}

std::unique_ptr<FormNode> FormNode::clone(FormNode* parent) const {
  std::unique_ptr<FormNode> copy(
      new FormNode(m_beginLine, m_endLine, m_className, m_nameStart, m_nameLength));
  copy->m_parent = parent;
  copy->copyBody(*this, copy.get());
  copy->rebuildChildren();
  return copy;
}

// --- FormParser ------------------------------------------------------------------------------------------

class FormParser {
 public:
  FormParser(const FormDescription::Lines& lines, std::size_t& position, const QString& fileName)
      : m_lines(lines), m_position(position), m_fileName(fileName) {}

  /// Parses the Begin block at the current line.
  std::unique_ptr<FormNode> parseNode(FormNode* parent, int depth) {
    const std::size_t beginIndex = m_position;
    const SourceLine& beginLine = *m_lines(beginIndex);
    if (depth > kMaxNesting) fail(beginIndex, QStringLiteral("controls nested too deeply"));
    qsizetype classStart = 0;
    qsizetype nameStart = 0;
    const QStringView className = wordAt(beginLine.text, 1, &classStart);
    const QStringView name = wordAt(beginLine.text, 2, &nameStart);
    if (className.isEmpty() || name.isEmpty())
      fail(beginIndex, QStringLiteral("Begin without a class and a name"));
    std::unique_ptr<FormNode> node(
        new FormNode(beginLine, SourceLine{}, className.toString(), nameStart, name.size()));
    node->m_parent = parent;
    parseBody(*node, node.get(), depth);
    node->rebuildChildren();
    return node;
  }

 private:
  std::unique_ptr<PropertyBlock> parseBlock(int depth) {
    const std::size_t beginIndex = m_position;
    if (depth > kMaxNesting) fail(beginIndex, QStringLiteral("property groups nested too deeply"));
    const SourceLine& beginLine = *m_lines(beginIndex);
    if (wordAt(beginLine.text, 1).isEmpty()) fail(beginIndex, QStringLiteral("BeginProperty without a name"));
    auto block = PropertyBlock::create(beginLine, SourceLine{});
    parseBody(*block, nullptr, depth);
    return block;
  }

  /// Reads the lines after the group's begin line through its end line; `node` is null inside a
  /// BeginProperty group, where controls cannot appear.
  void parseBody(PropertyGroup& group, FormNode* node, int depth) {
    const std::size_t beginIndex = m_position++;
    while (const SourceLine* next = m_lines(m_position)) {
      const SourceLine& line = *next;
      switch (classifyLine(line.text)) {
        case LineKind::Blank:
          group.m_items.emplace_back(PropertyGroup::OtherLine{line});
          ++m_position;
          break;
        case LineKind::Begin:
          if (!node) fail(m_position, QStringLiteral("Begin inside a BeginProperty group"));
          group.m_items.emplace_back(parseNode(node, depth + 1));
          break;
        case LineKind::BeginProperty:
          group.m_items.emplace_back(parseBlock(depth + 1));
          break;
        case LineKind::End:
          if (!node) fail(m_position, QStringLiteral("End where EndProperty was expected"));
          group.m_endLine = line;
          ++m_position;
          return;
        case LineKind::EndProperty:
          if (node) fail(m_position, QStringLiteral("EndProperty without BeginProperty"));
          group.m_endLine = line;
          ++m_position;
          return;
        case LineKind::Other: {
          std::optional<PropertyGroup::PropertyLine> property = PropertyGroup::parsePropertyLine(line);
          if (!property) {
            fail(m_position, QStringLiteral("unexpected text in the form description: %1")
                                 .arg(line.text.trimmed().left(60)));
          }
          group.m_items.emplace_back(std::move(*property));
          ++m_position;
          break;
        }
      }
    }
    fail(beginIndex, QStringLiteral("%1 has no matching %2")
                         .arg(m_lines(beginIndex)->text.trimmed(),
                              node ? QStringLiteral("End") : QStringLiteral("EndProperty")));
  }

  [[noreturn]] void fail(std::size_t lineIndex, const QString& problem) const {
    throw ide::Error(ide::err::InvalidFileFormat,
                     QStringLiteral("%1, line %2: %3").arg(m_fileName).arg(lineIndex + 1).arg(problem));
  }

  const FormDescription::Lines& m_lines;
  std::size_t& m_position;
  const QString& m_fileName;
};

// --- FormDescription -------------------------------------------------------------------------------------

FormDescription::FormDescription(const QString& className, const QString& name, LineEnd lineEnd) {
  if (!isWritablePropertyName(className) || !isWritablePropertyName(name)) {
    throw ide::Error(ide::err::InvalidProcedureCall,
                     QStringLiteral("Invalid class or name \"%1 %2\"").arg(className, name));
  }
  const QString prefix = QStringLiteral("Begin ") + className + u' ';
  m_root.reset(new FormNode(SourceLine{prefix + name + u' ', lineEnd},
                            SourceLine{QStringLiteral("End"), lineEnd}, className, prefix.size(),
                            name.size()));
}

FormDescription::FormDescription(std::unique_ptr<FormNode> root) : m_root(std::move(root)) {}

FormDescription::FormDescription(const FormDescription& other) : m_root(other.m_root->clone(nullptr)) {}

FormDescription& FormDescription::operator=(const FormDescription& other) {
  if (this != &other) m_root = other.m_root->clone(nullptr);
  return *this;
}

FormDescription::FormDescription(FormDescription&&) noexcept = default;
FormDescription& FormDescription::operator=(FormDescription&&) noexcept = default;
FormDescription::~FormDescription() = default;

FormDescription FormDescription::parse(const Lines& lines, std::size_t& position, const QString& fileName) {
  const SourceLine* first = lines(position);
  if (!first || classifyLine(first->text) != LineKind::Begin) {
    throw ide::Error(ide::err::InvalidFileFormat,
                     QStringLiteral("%1, line %2: a form description must start with Begin")
                         .arg(fileName)
                         .arg(position + 1));
  }
  FormParser parser(lines, position, fileName);
  return FormDescription(parser.parseNode(nullptr, 0));
}

FormDescription FormDescription::parse(const std::vector<SourceLine>& lines, std::size_t& position,
                                       const QString& fileName) {
  return parse([&](std::size_t index) { return index < lines.size() ? &lines[index] : nullptr; }, position,
               fileName);
}

void FormDescription::appendLines(std::vector<SourceLine>& out) const {
  m_root->appendLines(out);
}

}  // namespace host
