// SPDX-License-Identifier: MIT
#include "host/model/designer.h"

#include "host/files/controlclasses.h"
#include "host/files/vbliteral.h"
#include "host/model/objects.h"
#include "host/model/vbe.h"

#include <QStringList>

#include <algorithm>

namespace host {
namespace {

inline constexpr long kInvalidPropertyValue = 380;

bool isName(const QString& name) {
  return name.compare(QLatin1StringView("Name"), Qt::CaseInsensitive) == 0;
}
bool isIndex(const QString& name) {
  return name.compare(QLatin1StringView("Index"), Qt::CaseInsensitive) == 0;
}

/// A valid VB identifier of at most 40 characters (the IDE's limit for control names).
bool isValidControlName(const QString& name) {
  if (name.isEmpty() || name.size() > 40 || !name.front().isLetter()) return false;
  for (const QChar c : name)
    if (!c.isLetterOrNumber() && c != u'_') return false;
  return true;
}

QString withoutLibrary(const QString& className) {
  const qsizetype dot = className.indexOf(u'.');
  return dot < 0 ? className : className.sliced(dot + 1);
}

/// The value of a property, by name, of one control.
class PropertyImpl final : public ide::Property {
 public:
  PropertyImpl(std::shared_ptr<ControlImpl> control, QString name)
      : m_control(std::move(control)), m_name(std::move(name)) {}
  QString Name() override { return m_name; }
  QVariant Value() override { return m_control->property(m_name); }
  void setValue(const QVariant& value) override { m_control->setProperty(m_name, value); }

 private:
  std::shared_ptr<ControlImpl> m_control;
  QString m_name;
};

class ControlPropertiesImpl final : public ide::Properties {
 public:
  explicit ControlPropertiesImpl(std::shared_ptr<ControlImpl> control) : m_control(std::move(control)) {}
  int Count() override { return static_cast<int>(m_control->propertyNames().size()); }
  ide::Ref<ide::Property> Item(int index) override {
    const QStringList names = m_control->propertyNames();
    if (index < 1 || index > names.size()) ide::raise(ide::err::SubscriptOutOfRange);
    return std::make_shared<PropertyImpl>(m_control, names[index - 1]);
  }
  ide::Ref<ide::Property> Item(const QString& name) override {
    for (const QString& known : m_control->propertyNames())
      if (known.compare(name, Qt::CaseInsensitive) == 0)
        return std::make_shared<PropertyImpl>(m_control, known);
    ide::raise(ide::err::SubscriptOutOfRange);
  }

 private:
  std::shared_ptr<ControlImpl> m_control;
};

/// A module's only property, its Name.
class NamePropertyImpl final : public ide::Property {
 public:
  explicit NamePropertyImpl(std::shared_ptr<ComponentImpl> component) : m_component(std::move(component)) {}
  QString Name() override { return QStringLiteral("Name"); }
  QVariant Value() override { return m_component->Name(); }
  void setValue(const QVariant& value) override { m_component->setName(value.toString()); }

 private:
  std::shared_ptr<ComponentImpl> m_component;
};

class NameOnlyPropertiesImpl final : public ide::Properties {
 public:
  explicit NameOnlyPropertiesImpl(std::shared_ptr<ComponentImpl> component)
      : m_component(std::move(component)) {}
  int Count() override { return 1; }
  ide::Ref<ide::Property> Item(int index) override {
    if (index != 1) ide::raise(ide::err::SubscriptOutOfRange);
    return std::make_shared<NamePropertyImpl>(m_component);
  }
  ide::Ref<ide::Property> Item(const QString& name) override {
    if (!isName(name)) ide::raise(ide::err::SubscriptOutOfRange);
    return std::make_shared<NamePropertyImpl>(m_component);
  }

 private:
  std::shared_ptr<ComponentImpl> m_component;
};

class ControlsImpl final : public ide::VBControls {
 public:
  ControlsImpl(std::shared_ptr<FormImpl> form, bool selectedOnly)
      : m_form(std::move(form)), m_selectedOnly(selectedOnly) {}

  int Count() override { return static_cast<int>(list().size()); }
  ide::Ref<ide::VBControl> Item(int index) override {
    const auto controls = list();
    if (index < 1 || index > static_cast<int>(controls.size())) ide::raise(ide::err::SubscriptOutOfRange);
    return controls[static_cast<size_t>(index - 1)];
  }
  ide::Ref<ide::VBControl> Item(const QString& name) override {
    for (const auto& control : list())
      if (control->node() && control->node()->name().compare(name, Qt::CaseInsensitive) == 0) return control;
    ide::raise(ide::err::SubscriptOutOfRange);
  }
  ide::Ref<ide::VBControl> Add(const QString& progId, const ide::Ref<ide::VBControl>& container) override {
    return m_form->addControl(progId, std::dynamic_pointer_cast<ControlImpl>(container));
  }
  void Remove(const ide::Ref<ide::VBControl>& control) override {
    auto impl = std::dynamic_pointer_cast<ControlImpl>(control);
    if (!impl || impl->form() != m_form) ide::raise(ide::err::InvalidProcedureCall);
    m_form->removeControl(impl);
  }

 private:
  std::vector<std::shared_ptr<ControlImpl>> list() {
    if (!m_selectedOnly) return m_form->controls();
    std::vector<std::shared_ptr<ControlImpl>> selected;
    for (const auto& weak : m_form->selection())
      if (auto control = weak.lock(); control && control->node()) selected.push_back(control);
    return selected;
  }

  std::shared_ptr<FormImpl> m_form;
  bool m_selectedOnly;
};

}  // namespace

QString defaultNamePrefix(const QString& className) {
  static const std::map<QString, QString> prefixes = {
      {QStringLiteral("TextBox"), QStringLiteral("Text")},
      {QStringLiteral("CommandButton"), QStringLiteral("Command")},
      {QStringLiteral("ComboBox"), QStringLiteral("Combo")},
      {QStringLiteral("ListBox"), QStringLiteral("List")},
      {QStringLiteral("CheckBox"), QStringLiteral("Check")},
      {QStringLiteral("OptionButton"), QStringLiteral("Option")},
      {QStringLiteral("PictureBox"), QStringLiteral("Picture")},
      {QStringLiteral("HScrollBar"), QStringLiteral("HScroll")},
      {QStringLiteral("VScrollBar"), QStringLiteral("VScroll")},
      {QStringLiteral("DriveListBox"), QStringLiteral("Drive")},
      {QStringLiteral("DirListBox"), QStringLiteral("Dir")},
      {QStringLiteral("FileListBox"), QStringLiteral("File")},
      {QStringLiteral("Menu"), QStringLiteral("mnu")},
  };
  const QString bare = withoutLibrary(className);
  const auto it = prefixes.find(bare);
  return it == prefixes.end() ? bare : it->second;
}

std::shared_ptr<ide::Properties> makeControlProperties(const std::shared_ptr<ControlImpl>& control) {
  return std::make_shared<ControlPropertiesImpl>(control);
}

std::shared_ptr<ide::Properties> makeNameOnlyProperties(const std::shared_ptr<ComponentImpl>& component) {
  return std::make_shared<NameOnlyPropertiesImpl>(component);
}

// ---------------------------------------------------------------------------------------------------
// Controls

ControlImpl::ControlImpl(const std::shared_ptr<FormImpl>& form, FormNode* node)
    : m_form(form), m_node(node) {}

FormNode& ControlImpl::liveNode() {
  if (!m_node || m_form.expired()) ide::raise(ide::err::ObjectVariableNotSet);
  return *m_node;
}

QString ControlImpl::ClassName() {
  return withoutLibrary(liveNode().className());
}

ide::Ref<ide::Properties> ControlImpl::Properties() {
  liveNode();
  return makeControlProperties(shared_from_this());
}

ide::Ref<ide::VBForm> ControlImpl::Parent() {
  return m_form.lock();
}

ide::Ref<ide::VBControl> ControlImpl::Container() {
  FormNode& node = liveNode();
  if (!node.parent()) return nullptr;
  return m_form.lock()->control(node.parent());
}

ControlFont ControlImpl::font() {
  ControlFont font;
  const PropertyBlock* block = nullptr;
  for (const FormNode* node = &liveNode(); node && !block; node = node->parent())
    block = node->propertyBlock(u"Font");
  if (!block) return font;
  const auto number = [&](QStringView name) {
    return parsePropertyValue(block->property(name).value_or(QString()), PropertyType::Double);
  };
  if (const auto name = unquoteVbString(block->property(u"Name").value_or(QString()))) font.name = *name;
  if (const QVariant size = number(u"Size"); size.isValid() && size.toDouble() > 0)
    font.size = size.toDouble();
  // Weight 700 is bold; files of older versions say Bold instead.
  if (const QVariant weight = number(u"Weight"); weight.isValid()) font.bold = weight.toDouble() >= 600;
  if (const QVariant bold = number(u"Bold"); bold.isValid()) font.bold = bold.toDouble() != 0;
  font.italic = number(u"Italic").toDouble() != 0;
  font.underline = number(u"Underline").toDouble() != 0;
  font.strikethrough = number(u"Strikethrough").toDouble() != 0;
  return font;
}

QStringList ControlImpl::propertyNames() {
  FormNode& node = liveNode();
  QStringList names;
  if (const ControlClassInfo* info = findControlClass(node.className()))
    for (const PropertyInfo& property : info->properties)
      names << property.name;
  auto addMissing = [&](const QString& name) {
    for (const QString& known : names)
      if (known.compare(name, Qt::CaseInsensitive) == 0) return;
    names << name;
  };
  addMissing(QStringLiteral("Name"));
  if (node.parent()) addMissing(QStringLiteral("Index"));  // the form itself is never an array element
  for (const QString& name : node.propertyNames())
    addMissing(name);
  return names;
}

bool ControlImpl::hasProperty(const QString& name) {
  for (const QString& known : propertyNames())
    if (known.compare(name, Qt::CaseInsensitive) == 0) return true;
  return false;
}

QVariant ControlImpl::property(const QString& name) {
  FormNode& node = liveNode();
  if (isName(name)) return node.name();
  if (isIndex(name) && node.parent()) return QVariant::fromValue(static_cast<qint16>(node.index()));
  if (!hasProperty(name)) ide::raise(ide::err::SubscriptOutOfRange);
  const PropertyInfo info = propertyInfoOrUntyped(node.className(), name);
  if (const auto text = node.property(name)) {
    if (const auto reference = parseFrxReference(*text)) {
      const QVariant value = m_form.lock()->binaryValue(node, name, *reference);
      return value.isValid() ? value : QVariant(*text);
    }
    const QVariant value = parsePropertyValue(*text, info.type);
    return value.isValid() ? value : QVariant(*text);
  }
  return info.defaultValue;
}

void ControlImpl::setProperty(const QString& name, const QVariant& value) {
  FormNode& node = liveNode();
  auto form = m_form.lock();
  auto self = shared_from_this();
  if (isName(name)) {
    const QString newName = value.toString().trimmed();
    if (!node.parent()) {  // the form's name is its component's
      if (auto component = form->component()) component->setName(newName);
      return;
    }
    const QString oldName = node.name();
    if (newName == oldName) return;
    if (!isValidControlName(newName)) ide::raise(ide::err::InvalidName);
    // The name of another control may only be shared as another element of its control array.
    for (const auto& other : form->controls()) {
      if (other.get() == this || other->node()->name().compare(newName, Qt::CaseInsensitive) != 0) continue;
      if (node.index() < 0 || other->node()->index() < 0 || other->node()->index() == node.index())
        ide::raise(ide::err::NameConflict);
    }
    node.setName(newName);
    form->changed(this);
    if (auto component = form->component(); component && component->project())
      component->project()->vbe()->fireControlRenamed(self, oldName, node.index());
    return;
  }
  if (isIndex(name) && node.parent()) {
    bool ok = false;
    const int index = value.toInt(&ok);
    if (!ok || index < -1 || index > 32767)
      ide::raise(kInvalidPropertyValue, QStringLiteral("Invalid property value"));
    const int oldIndex = node.index();
    if (index == oldIndex) return;
    if (index >= 0) {
      for (const auto& other : form->controls())
        if (other.get() != this && other->node()->name().compare(node.name(), Qt::CaseInsensitive) == 0 &&
            other->node()->index() == index)
          ide::raise(ide::err::NameConflict);
    }
    node.setIndex(index);
    form->changed(this);
    if (auto component = form->component(); component && component->project())
      component->project()->vbe()->fireControlRenamed(self, node.name(), oldIndex);
    return;
  }
  if (!hasProperty(name)) ide::raise(ide::err::SubscriptOutOfRange);
  const PropertyInfo info = propertyInfoOrUntyped(node.className(), name);
  if (setBinaryProperty(name, value, info)) return;
  const auto converted = convertPropertyValue(value, info);
  if (!converted) ide::raise(kInvalidPropertyValue, QStringLiteral("Invalid property value"));
  // The IDE leaves properties at their defaults out of the description.
  if (info.defaultValue.isValid() && *converted == info.defaultValue && info.type != PropertyType::String &&
      info.type != PropertyType::Untyped) {
    if (node.removeProperty(name)) form->changed(this);
    return;
  }
  const FormattedValue formatted = formatPropertyValue(*converted, info);
  const auto before = node.property(name);
  node.setProperty(info.name.isEmpty() ? name : info.name, formatted.valueText, formatted.comment);
  if (before != node.property(name) || node.propertyComment(name) != formatted.comment) form->changed(this);
}

bool ControlImpl::setBinaryProperty(const QString& name, const QVariant& value, const PropertyInfo& info) {
  FormNode& node = liveNode();
  auto form = m_form.lock();
  const auto invalid = [] { ide::raise(kInvalidPropertyValue, QStringLiteral("Invalid property value")); };
  switch (frxRecordKind(node.className(), name)) {
    case FrxRecordKind::Picture: {
      if (value.isValid() && value.typeId() != QMetaType::QByteArray) invalid();
      const QByteArray picture = value.toByteArray();
      if (picture.isEmpty()) {  // (None)
        if (node.property(name))
          form->storeBinary(*this, name, std::nullopt, false, [&] { node.removeProperty(name); });
      } else {
        form->storeBinary(*this, name, encodeFrxPicture(picture), false);
      }
      return true;
    }
    case FrxRecordKind::List: {
      if (value.isValid() && value.typeId() != QMetaType::QStringList &&
          value.typeId() != QMetaType::QVariantList)
        invalid();
      const QStringList items = value.toStringList();
      if (items.isEmpty()) {
        if (node.property(name))
          form->storeBinary(*this, name, std::nullopt, false, [&] { node.removeProperty(name); });
        return true;
      }
      // A list written again keeps the field after its count.
      std::optional<quint16> field;
      if (const auto before = node.property(name))
        if (const auto reference = parseFrxReference(*before))
          if (const auto old = form->binary().listSecondField(reference->offset);
              old && form->binary().list(reference->offset) &&
              *old != form->binary().list(reference->offset)->size())
            field = old;
      const auto record = encodeFrxList(items, field);
      if (!record) invalid();
      form->storeBinary(*this, name, record, false);
      return true;
    }
    case FrxRecordKind::Text:
    case FrxRecordKind::ItemData:
    case FrxRecordKind::Other:
      break;
  }
  if (info.type != PropertyType::String) return false;
  const auto converted = convertPropertyValue(value, info);
  if (!converted) invalid();
  const QString text = converted->toString();
  // What a property line cannot hold: a line break or another control character, or more than fits on
  // one of the IDE's lines.
  const qsizetype lineLength = node.indent().size() + 3 + kPropertyNameWidth + 4 + quoteVbString(text).size();
  const bool binary = lineLength > kMaxLineLength ||
                      std::any_of(text.begin(), text.end(), [](QChar c) { return c < u' ' && c != u'\t'; });
  if (binary) {
    const auto record = encodeFrxText(text);
    if (!record) invalid();
    form->storeBinary(*this, name, record, true);
    return true;
  }
  const auto before = node.property(name);
  if (!before || !parseFrxReference(*before)) return false;
  // Back on its line: the binary file no longer holds it.
  form->storeBinary(*this, name, std::nullopt, false,
                    [&] { node.setProperty(info.name.isEmpty() ? name : info.name, quoteVbString(text)); });
  return true;
}

// ---------------------------------------------------------------------------------------------------
// Forms

QVariant FormImpl::binaryValue(const FormNode& owner, QStringView property,
                               const FrxReference& reference) const {
  switch (frxRecordKind(owner.className(), property, reference.longText)) {
    case FrxRecordKind::Text:
      if (const auto text = m_binary.text(reference)) return *text;
      break;
    case FrxRecordKind::List:
      if (const auto items = m_binary.list(reference.offset)) return *items;
      break;
    case FrxRecordKind::ItemData:
      if (const auto numbers = m_binary.itemData(reference.offset)) {
        QVariantList values;
        for (const qint32 number : *numbers)
          values.append(number);
        return values;
      }
      break;
    case FrxRecordKind::Picture:
      if (const auto picture = m_binary.picture(reference.offset)) return *picture;
      break;
    case FrxRecordKind::Other:
      break;
  }
  return {};
}

void FormImpl::storeBinary(ControlImpl& control, const QString& property,
                           const std::optional<QByteArray>& record, bool longText,
                           const std::function<void()>& writeLine) {
  auto component = m_component.lock();
  FormNode& node = control.liveNode();
  const QString fileName = component ? component->binaryFileName() : QString();
  // Where every record ends is read before the line changes, while its reference is still there.
  const auto ends = frxRecordEnds(m_description.root(), m_binary);
  if (record) node.setProperty(property, formatFrxReference({fileName, 0, longText}));
  if (writeLine) writeLine();
  const QString displayName = component ? component->binaryFilePath() : fileName;
  m_binary = FrxFile(rebuildFrx(m_description.root(), m_binary, ends, fileName, &node, property,
                                record.value_or(QByteArray()), displayName));
  m_binaryChanged = true;
  changed(&control);
}

FormImpl::FormImpl(const std::shared_ptr<ComponentImpl>& component, FormDescription& description)
    : m_component(component), m_description(description) {}

ide::Ref<ide::VBControls> FormImpl::VBControls() {
  return std::make_shared<ControlsImpl>(shared_from_this(), false);
}

ide::Ref<ide::VBControls> FormImpl::SelectedVBControls() {
  return std::make_shared<ControlsImpl>(shared_from_this(), true);
}

ide::Ref<ide::VBComponent> FormImpl::Parent() {
  return m_component.lock();
}

std::shared_ptr<ControlImpl> FormImpl::control(FormNode* node) {
  auto& slot = m_controls[node];
  if (!slot) slot = std::make_shared<ControlImpl>(shared_from_this(), node);
  return slot;
}

std::vector<std::shared_ptr<ControlImpl>> FormImpl::controls() {
  std::vector<std::shared_ptr<ControlImpl>> result;
  std::function<void(FormNode&)> walk = [&](FormNode& node) {
    for (FormNode* child : node.children()) {
      result.push_back(control(child));
      walk(*child);
    }
  };
  walk(m_description.root());
  return result;
}

std::shared_ptr<ControlImpl> FormImpl::findControl(const QString& name, int index) {
  if (FormNode* node = m_description.root().findNode(name, index)) return control(node);
  return nullptr;
}

std::shared_ptr<ControlImpl> FormImpl::addControl(const QString& progId,
                                                  const std::shared_ptr<ControlImpl>& container) {
  const ControlClassInfo* info = findControlClass(progId);
  if (!info) ide::raise(ide::err::InvalidProcedureCall);
  FormNode* parent = container ? &container->liveNode() : &m_description.root();
  if (container && container->form().get() != this) ide::raise(ide::err::InvalidProcedureCall);

  const QString prefix = defaultNamePrefix(info->className);
  QString name;
  for (int n = 1;; ++n) {
    name = prefix + QString::number(n);
    if (!m_description.root().findNode(name)) break;
  }
  FormNode& node = parent->addChild(info->className, name);
  auto created = control(&node);
  // What the IDE gives a new control: its name as caption or text, a place and a size, the next tab stop.
  // Only what the class has: a Timer has a place but no size, a Line has neither, a Menu none of them.
  auto give = [&](const char* property, const QString& valueText) {
    const QString name = QString::fromLatin1(property);
    if (findPropertyInfo(info->className, name)) node.setProperty(name, valueText);
  };
  give("Caption", quoteVbString(name));
  give("Text", quoteVbString(name));
  const int count = static_cast<int>(controls().size());
  give("Height", QStringLiteral("375"));
  give("Left", QString::number(120 + (count % 8) * 240));
  give("Top", QString::number(120 + (count % 8) * 480));
  give("Width", QStringLiteral("1215"));
  if (findPropertyInfo(info->className, QStringLiteral("TabIndex"))) {
    int tabIndex = 0;
    for (const auto& other : controls())
      if (other.get() != created.get() && other->node()->property(QStringLiteral("TabIndex"))) ++tabIndex;
    node.setProperty(QStringLiteral("TabIndex"), QString::number(tabIndex));
  }
  changed(nullptr);
  if (auto component = m_component.lock(); component && component->project())
    component->project()->vbe()->fireControlAdded(created);
  return created;
}

void FormImpl::removeControl(const std::shared_ptr<ControlImpl>& control) {
  FormNode& node = control->liveNode();
  if (!node.parent()) ide::raise(ide::err::InvalidProcedureCall);  // the form itself
  auto component = m_component.lock();
  auto vbe = component && component->project() ? component->project()->vbe() : nullptr;
  // Inner controls go first, then the control itself; each is told while it still stands on the form.
  std::vector<std::shared_ptr<ControlImpl>> removed;
  std::function<void(FormNode&)> collect = [&](FormNode& n) {
    for (FormNode* child : n.children())
      collect(*child);
    removed.push_back(this->control(&n));
  };
  collect(node);
  if (vbe)
    for (const auto& c : removed)
      vbe->fireControlRemoved(c);
  if (!control->node()) return;  // a handler removed it already
  FormNode* parent = control->node()->parent();
  std::unique_ptr<FormNode> taken = parent->takeChild(*control->node());
  for (const auto& c : removed) {
    m_controls.erase(c->node());
    c->detach();
  }
  std::erase_if(m_selection,
                [](const std::weak_ptr<ControlImpl>& w) { return !w.lock() || !w.lock()->node(); });
  changed(nullptr);
}

void FormImpl::setSelection(const std::vector<std::shared_ptr<ControlImpl>>& controls) {
  std::vector<std::shared_ptr<ControlImpl>> before;
  for (const auto& weak : m_selection)
    if (auto control = weak.lock(); control && control->node()) before.push_back(control);
  m_selection.assign(controls.begin(), controls.end());
  auto component = m_component.lock();
  auto vbe = component && component->project() ? component->project()->vbe() : nullptr;
  if (vbe) {
    auto contains = [](const std::vector<std::shared_ptr<ControlImpl>>& list,
                       const std::shared_ptr<ControlImpl>& c) {
      return std::find(list.begin(), list.end(), c) != list.end();
    };
    for (const auto& control : before)
      if (!contains(controls, control)) vbe->fireSelectedControl(control, false);
    for (const auto& control : controls)
      if (!contains(before, control)) vbe->fireSelectedControl(control, true);
  }
  controlChanged.fire(nullptr);
}

void FormImpl::changed(ControlImpl* control) {
  if (auto component = m_component.lock()) component->markChanged();
  controlChanged.fire(control);
}

}  // namespace host
