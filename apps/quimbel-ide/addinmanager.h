// SPDX-License-Identifier: MIT
// The Add-In Manager: the registered add-ins with their load behaviour. Loading or unloading takes effect
// when the dialog is confirmed, while the IDE keeps running; "Load on Startup" is remembered for the next
// start.
#pragma once

#include "host/model/addins.h"

#include <QDialog>

#include <functional>
#include <memory>
#include <vector>

class QCheckBox;
class QLabel;
class QTreeWidget;

namespace desktop {

class AddInManagerDialog final : public QDialog {
  Q_OBJECT

 public:
  AddInManagerDialog(host::AddInsImpl& addIns, QWidget* parent = nullptr);

  /// Applies the choices: connects, disconnects and sets the start-up behaviour. Failures are told to
  /// `report` and the other add-ins still change.
  void apply(const std::function<void(const QString&)>& report);
  /// Where "Load on Startup" choices are stored (the IDE reads them when it starts).
  void setStartupStore(std::function<void(const QString& progId, bool load)> store) {
    m_store = std::move(store);
  }

 private:
  struct Choice {
    std::shared_ptr<host::AddInImpl> addIn;
    bool loaded;
    bool onStartup;
  };
  void showChoice();
  void takeChoice();
  static QString behaviour(const Choice& choice);

  host::AddInsImpl& m_addIns;
  std::vector<Choice> m_choices;
  QTreeWidget* m_list;
  QLabel* m_description;
  QCheckBox* m_loaded;
  QCheckBox* m_onStartup;
  std::function<void(const QString&, bool)> m_store;
};

}  // namespace desktop
