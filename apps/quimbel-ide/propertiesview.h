// SPDX-License-Identifier: MIT
// The properties window: the object box (the form or module and its controls, to choose another), the
// Alphabetic and Categorized tabs, the properties of the selected control (or form, or module) with their
// values, edited in place, and a pane describing the current property. Enumerations and Booleans are
// chosen from lists. A value goes through the control's property, so Name renames the control (firing the
// rename event) and Index makes it a control-array element; a refused value is reported and the grid
// shows the value again.
#pragma once

#include "host/model/designer.h"
#include "host/model/objects.h"
#include "ide/signal.h"

#include <QWidget>

#include <functional>
#include <memory>

class QComboBox;
class QLabel;
class QTabBar;
class QTableWidget;

namespace desktop {

class PropertiesView final : public QWidget {
  Q_OBJECT

 public:
  explicit PropertiesView(QWidget* parent = nullptr);
  ~PropertiesView() override;

  void setErrorReporter(std::function<void(const QString&)> reporter) { m_report = std::move(reporter); }
  /// Shows a control's (or a form's root control's) properties.
  void showControl(const std::shared_ptr<host::ControlImpl>& control);
  /// Shows a component's properties: its form's when it has one, else its Name.
  void showComponent(const std::shared_ptr<host::ComponentImpl>& component);
  void clear();
  /// Sets a property as an edit in the grid does; false when the value was refused (and reported).
  bool applyEdit(const QString& property, const QString& text);
  /// The text the grid shows for a property (empty when it has no such row).
  QString shownValue(const QString& property) const;
  QTableWidget* table() const { return m_table; }
  QComboBox* objectBox() const { return m_objects; }
  QTabBar* tabs() const { return m_tabs; }
  QLabel* description() const { return m_description; }
  /// Lists the properties by category (the Categorized tab) or alphabetically.
  void setCategorized(bool categorized);
  /// The category the window files a property under ("Appearance", "Behavior" ... "Misc").
  static QString categoryOf(const QString& property);

  /// How a property value is shown ("2 - CenterScreen", "True", "&H8000000F&").
  static QString displayText(const QVariant& value, const QString& className, const QString& property);

 Q_SIGNALS:
  /// Another object was chosen in the object box (the form's root control for the form itself).
  void objectChosen(const std::shared_ptr<host::ControlImpl>& control);

 private:
  void rebuild();
  void refreshValues();
  void fillObjects();
  void describeCurrent();

  QComboBox* m_objects;
  QTabBar* m_tabs;
  QTableWidget* m_table;
  QLabel* m_description;
  bool m_categorized = false;
  std::shared_ptr<host::ControlImpl> m_control;
  std::shared_ptr<host::ComponentImpl> m_component;  // a module without a form
  ide::Connection m_formChanged;
  std::function<void(const QString&)> m_report;
  bool m_filling = false;
};

}  // namespace desktop
