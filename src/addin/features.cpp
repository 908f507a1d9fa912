// SPDX-License-Identifier: MIT
// The one place that says what each feature area does today. Numbering and indentation open their dialogs;
// the extended find shows its window, which lives until the add-in shuts down. Every other area is not part
// of the add-in yet: its command and its events are connected and arrive here, and do nothing until the area
// lands; no stand-in dialog pretends to be the feature meanwhile.
#include "addin/features.h"

#include "addin/envutils.h"
#include "common/settings.h"
#include "find/frmfind.h"
#include "transform/dialogs.h"

#include <QPointer>
#include <QWidget>

namespace addin {
namespace {

class AddInFeatures final : public Features {
 public:
  explicit AddInFeatures(const FeatureServices& services)
      : m_vbe(services.vbe), m_settings(services.settings) {}
  // The find window is a child of the IDE's window when there is one, which may have deleted it already.
  ~AddInFeatures() override { delete m_findForm.data(); }

  void showLineNumbering() override { transform::showLineNumberingDialog(m_vbe, m_settings, dialogParent()); }
  void showIndentation() override { transform::showIndentationDialog(m_vbe, m_settings, dialogParent()); }

  // Not there yet: the favourites.
  void showFavorites() override {}
  void addFavorite(const FavoritePlace&) override {}
  void componentRenamed(const ide::Ref<ide::VBComponent>&, const QString&) override {}
  // Not there yet: the keyboard macros and the copy buffers (and so no hotkeys).
  void showMacros() override {}
  void showCopyBuffers() override {}
  HotKeyClient* copyBuffers() override { return nullptr; }
  HotKeyClient* macros() override { return nullptr; }
  void showExtendedFind() override;
  void findWindowProjectRemoved(const ide::Ref<ide::VBProject>& project) override {
    if (m_findForm && m_findForm->isVisible()) m_findForm->RemoveItemsOfProject(project->Name());
  }
  void findWindowComponentRemoved(const ide::Ref<ide::VBComponent>& component) override {
    if (m_findForm && m_findForm->isVisible()) m_findForm->RemoveItemsOfComponent(component->Name());
  }
  // Not there yet: the task list.
  void showTaskList() override {}
  // Not there yet: the new-procedure wizard.
  void showNewProcedure() override {}
  // Not there yet: the options dialog and the designer actions.
  void showOptions() override {}
  void componentAdded(const ide::Ref<ide::VBComponent>&) override {}
  void controlAdded(const ide::Ref<ide::VBControl>&) override {}
  void controlRenamed(const ide::Ref<ide::VBControl>&, const QString&, int) override {}
  // Not there yet: the project identity and info files (which also hold the favourites).
  void projectAdded(const ide::Ref<ide::VBProject>&) override {}
  void projectRemoved(const ide::Ref<ide::VBProject>&) override {}
  void projectRenamed(const ide::Ref<ide::VBProject>&, const QString&) override {}
  void projectFileMoved(const ide::Ref<ide::VBProject>&, const QString&, const QString&) override {}
  bool isIdentityModule(const ide::Ref<ide::VBComponent>&) override { return false; }
  void allProjectsClosed() override {}
  void componentRemoved(const ide::Ref<ide::VBComponent>&) override {}

 private:
  QWidget* dialogParent() const { return qobject_cast<QWidget*>(m_vbe->Platform().ui().dialogParent()); }

  ide::Ref<ide::VBE> m_vbe;
  common::SettingsStore& m_settings;
  QPointer<find::frmFind> m_findForm;
};

void AddInFeatures::showExtendedFind() {
  if (!m_findForm) m_findForm = new find::frmFind(m_vbe, dialogParent());
  // The code window's selection is the text to look for.
  QString selected;
  try {
    selected = CEnvUtils(*m_vbe).GetSelectedText();
  } catch (const std::exception&) {
  }
  m_findForm->Show(selected);
}

}  // namespace

std::unique_ptr<Features> createFeatures(const FeatureServices& services) {
  return std::make_unique<AddInFeatures>(services);
}

}  // namespace addin
