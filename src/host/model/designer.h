// SPDX-License-Identifier: MIT
// Form designers: the form description of a component seen as the form's root control and the controls
// on it, with their properties read and written through the IDE's property tables. Values kept in the
// form's binary file (.frx) read as themselves: texts, lists, pictures. Every control keeps its identity
// while it stays on the form; renaming, re-indexing, adding and removing fire the control events.
#pragma once

#include "host/files/controlclasses.h"
#include "host/files/formdescription.h"
#include "host/files/frxfile.h"
#include "ide/vbide.h"

#include <QString>

#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <vector>

namespace host {

class ComponentImpl;
class FormImpl;

/// A control's font as its "BeginProperty Font" group describes it.
struct ControlFont {
  QString name = QStringLiteral("MS Sans Serif");  // what a form without a Font group uses
  double size = 8.25;                              // points
  bool bold = false;
  bool italic = false;
  bool underline = false;
  bool strikethrough = false;
  bool operator==(const ControlFont&) const = default;
};

class ControlImpl final : public ide::VBControl, public std::enable_shared_from_this<ControlImpl> {
 public:
  ControlImpl(const std::shared_ptr<FormImpl>& form, FormNode* node);

  QString ClassName() override;
  ide::Ref<ide::Properties> Properties() override;
  ide::Ref<ide::VBForm> Parent() override;
  ide::Ref<ide::VBControl> Container() override;

  /// The control's node in the form description; null once the control left the form.
  FormNode* node() const { return m_node; }
  void detach() { m_node = nullptr; }
  std::shared_ptr<FormImpl> form() const { return m_form.lock(); }
  /// The form description node, or error 91 when the control left the form.
  FormNode& liveNode();

  /// Reads a property: what the form description says, else the class's default. A value kept in the
  /// binary file reads as a text (QString), a list (QStringList; ItemData a QVariantList of numbers) or a
  /// picture (QByteArray: the picture file's bytes); when the file does not hold it, as its reference.
  /// Error 9 for a property the control does not have.
  QVariant property(const QString& name);
  /// Writes a property, converted to its type (error 380 when the value does not fit). Name and Index
  /// rename the control; the form's Name renames its component. A text with a line break (or too long for
  /// a line), a list (QStringList) and a picture (QByteArray; empty for none) go to the binary file.
  void setProperty(const QString& name, const QVariant& value);
  /// The control's font: its own Font group, else its container's (the IDE leaves out a Font that is the
  /// same as the container's), up to the form; a form without one uses MS Sans Serif 8.25.
  ControlFont font();
  /// The names of the control's properties: its class's, then any others its description holds.
  QStringList propertyNames();
  bool hasProperty(const QString& name);

 private:
  /// Writes a value that belongs in the binary file, or takes one out of it; false for other values.
  bool setBinaryProperty(const QString& name, const QVariant& value, const PropertyInfo& info);

  std::weak_ptr<FormImpl> m_form;
  FormNode* m_node;
};

class FormImpl final : public ide::VBForm, public std::enable_shared_from_this<FormImpl> {
 public:
  FormImpl(const std::shared_ptr<ComponentImpl>& component, FormDescription& description);

  ide::Ref<ide::VBControls> VBControls() override;
  ide::Ref<ide::VBControls> SelectedVBControls() override;
  ide::Ref<ide::VBControl> Root() override { return control(&m_description.root()); }
  ide::Ref<ide::VBComponent> Parent() override;

  /// The control object of a node (made once per node).
  std::shared_ptr<ControlImpl> control(FormNode* node);
  /// Every control on the form (not the form itself), in the description's order.
  std::vector<std::shared_ptr<ControlImpl>> controls();
  std::shared_ptr<ControlImpl> findControl(const QString& name, int index = -1);
  /// Adds a new control of an intrinsic class ("VB.TextBox" or "TextBox") into `container` (the form
  /// when empty), named as the IDE names new controls; fires the control's addition.
  std::shared_ptr<ControlImpl> addControl(const QString& progId,
                                          const std::shared_ptr<ControlImpl>& container);
  /// Removes a control and the controls inside it; fires their removal first.
  void removeControl(const std::shared_ptr<ControlImpl>& control);
  /// The designer's selection.
  const std::vector<std::weak_ptr<ControlImpl>>& selection() const { return m_selection; }
  void setSelection(const std::vector<std::shared_ptr<ControlImpl>>& controls);

  std::shared_ptr<ComponentImpl> component() const { return m_component.lock(); }
  FormDescription& description() { return m_description; }

  /// The form's binary file as read, or as rebuilt after a value in it changed.
  const FrxFile& binary() const { return m_binary; }
  void setBinary(FrxFile binary) { m_binary = std::move(binary); }
  /// Whether a value in the binary file changed since it was read or saved; binarySaved() clears it.
  bool binaryChanged() const { return m_binaryChanged; }
  void binarySaved() { m_binaryChanged = false; }
  /// The binary file is to be written whole with the description (it moves to a new name).
  void binaryMoved() { m_binaryChanged = true; }
  /// A value the description refers to in the binary file, or an invalid QVariant when the file does not
  /// hold it (or its layout is the control's own).
  QVariant binaryValue(const FormNode& owner, QStringView property, const FrxReference& reference) const;
  /// Puts a value into the binary file, or (with no record) takes it out after `writeLine` wrote the line
  /// that now holds the value. The file is rebuilt as the IDE writes it; the control changed.
  void storeBinary(ControlImpl& control, const QString& property, const std::optional<QByteArray>& record,
                   bool longText, const std::function<void()>& writeLine = {});
  /// Something on the form changed (the component must be saved; a designer view redraws).
  void changed(ControlImpl* control);
  /// Emitted after any change of a control (null: controls were added or removed).
  ide::Signal<ControlImpl*> controlChanged;

 private:
  std::weak_ptr<ComponentImpl> m_component;
  FormDescription& m_description;
  std::map<const FormNode*, std::shared_ptr<ControlImpl>> m_controls;
  std::vector<std::weak_ptr<ControlImpl>> m_selection;
  FrxFile m_binary;
  bool m_binaryChanged = false;
};

/// The property collection of a control, or of a module component (which has only its Name).
std::shared_ptr<ide::Properties> makeControlProperties(const std::shared_ptr<ControlImpl>& control);
std::shared_ptr<ide::Properties> makeNameOnlyProperties(const std::shared_ptr<ComponentImpl>& component);

/// The prefix of new controls' names ("Text" for a TextBox, "Command" for a CommandButton ...).
QString defaultNamePrefix(const QString& className);

}  // namespace host
