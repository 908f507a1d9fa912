// SPDX-License-Identifier: MIT
// The properties window: the properties of the selected control (or form, or module) with their values,
// edited in place. Enumerations and Booleans are chosen from lists. A value goes through the control's
// property, so Name renames the control (firing the rename event) and Index makes it a control-array
// element; a refused value is reported and the grid shows the value again.
#pragma once

#include "host/model/designer.h"
#include "host/model/objects.h"
#include "ide/signal.h"

#include <QWidget>

#include <functional>
#include <memory>

class QLabel;
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

  /// How a property value is shown ("2 - CenterScreen", "True", "&H8000000F&").
  static QString displayText(const QVariant& value, const QString& className, const QString& property);

 private:
  void rebuild();
  void refreshValues();

  QLabel* m_title;
  QTableWidget* m_table;
  std::shared_ptr<host::ControlImpl> m_control;
  std::shared_ptr<host::ComponentImpl> m_component;  // a module without a form
  ide::Connection m_formChanged;
  std::function<void(const QString&)> m_report;
  bool m_filling = false;
};

}  // namespace desktop
