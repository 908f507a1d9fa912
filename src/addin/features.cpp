// SPDX-License-Identifier: MIT
// The one place that says what each feature area does. Numbering, indentation, the new-procedure wizard and
// the options open their dialogs; the keyboard macros and the copy buffers open theirs and take their
// hotkeys; the project info objects keep every project's tasks and favourites; the extended find shows its
// window, which lives until the add-in shuts down; the designer actions follow new forms and controls and
// renamed controls.
#include "addin/features.h"

#include "addin/envutils.h"
#include "addin/help.h"
#include "addin/texts.h"
#include "addin/texttools.h"
#include "common/errors.h"
#include "common/settings.h"
#include "common/strings.h"
#include "designer/actions.h"
#include "designer/dialogs.h"
#include "find/frmfind.h"
#include "navigation/favorites.h"
#include "navigation/frmorgfav.h"
#include "newproc/frmnewproc.h"
#include "projinfo/frmtasks.h"
#include "projinfo/projinfos.h"
#include "transform/dialogs.h"

#include <QPointer>
#include <QWidget>

namespace addin {
namespace {

class AddInFeatures final : public Features {
 public:
  explicit AddInFeatures(const FeatureServices& services)
      : m_vbe(services.vbe),
        m_settings(services.settings),
        m_services(services),
        m_options(services.options),
        m_textTools(services),
        m_projInfos(projInfoServices(services)),
        m_designer(m_vbe->Platform().ui(), m_options, [this](const ide::Ref<ide::VBControl>& control) {
          return designer::showPropsDialog(control, m_options, m_vbe->Platform().ui(), dialogParent());
        }) {
    // The projects open when the add-in starts get their info objects now; one that fails is told and
    // the others (and the add-in) go on.
    for (const auto& project : m_vbe->VBProjects()->items()) {
      try {
        m_projInfos.projectAdded(project);
      } catch (const std::exception& failure) {
        common::recordError(failure, QStringLiteral("Features"), QStringLiteral("Startup"), __LINE__);
        common::logLastError();
        m_vbe->Platform().ui().MsgBox(QString::fromUtf16(kUndeterminedError), ide::mb::Critical,
                                      common::title());
      }
    }
  }
  // The find window is a child of the IDE's window when there is one, which may have deleted it already.
  ~AddInFeatures() override { delete m_findForm.data(); }

  void showLineNumbering() override {
    transform::showLineNumberingDialog(m_vbe, m_settings, m_options, dialogParent());
  }
  void showIndentation() override {
    transform::showIndentationDialog(m_vbe, m_settings, m_options, dialogParent());
  }

  // Favourites and tasks, of the active project.
  void showFavorites() override {
    if (projinfo::CProjInfo* info = activeInfo())
      if (auto* favorites = dynamic_cast<navigation::CFavorites*>(info->Favorites())) favorites->Show();
  }
  void showTaskList() override {
    if (projinfo::CProjInfo* info = activeInfo())
      if (projinfo::CTaskList* tasks = info->TaskList()) tasks->Show();
  }
  void addFavorite(const FavoritePlace& place) override {
    ide::Ref<ide::VBProject> project = place.project;
    try {
      if (place.component) project = place.component->Collection()->Parent();
    } catch (const std::exception& failure) {
      // The place's own project, as given, is used instead.
      common::logFailure(failure, QStringLiteral("AddInFeatures"), QStringLiteral("addFavorite"), __LINE__);
    }
    projinfo::CProjInfo* info = project ? m_projInfos.item(project) : nullptr;
    if (info && !info->isOpen()) return tell(info->unavailable());
    auto* favorites = info ? dynamic_cast<navigation::CFavorites*>(info->Favorites()) : nullptr;
    if (!favorites) return tell(common::LoadResString(kAddFavoriteFailed), ide::mb::Information);
    favorites->AddPlace(place.component, place.procName, place.procKind, place.line);
  }
  void showMacros() override { m_textTools.showMacros(); }
  void showCopyBuffers() override { m_textTools.showCopyBuffers(); }
  HotKeyClient* copyBuffers() override { return m_textTools.copyBuffers(); }
  HotKeyClient* macros() override { return m_textTools.macros(); }
  void showExtendedFind() override;
  void findWindowProjectRemoved(const ide::Ref<ide::VBProject>& project) override {
    if (m_findForm && m_findForm->isVisible()) m_findForm->RemoveItemsOfProject(project->Name());
  }
  void findWindowComponentRemoved(const ide::Ref<ide::VBComponent>& component) override {
    if (m_findForm && m_findForm->isVisible())
      m_findForm->RemoveItemsOfComponent(component->Name(), component->Collection()->Parent());
  }
  void showNewProcedure() override;
  // The options dialog and the designer actions.
  void showOptions() override {
    designer::showOptionsDialog(m_settings, m_options, m_vbe->Platform().ui(), dialogParent());
  }
  void componentAdded(const ide::Ref<ide::VBComponent>& component) override {
    m_projInfos.componentAdded(component);
    m_designer.FormAdded(component);
  }
  void controlAdded(const ide::Ref<ide::VBControl>& control) override { m_designer.ControlAdded(control); }
  void controlRenamed(const ide::Ref<ide::VBControl>& control, const QString& oldName,
                      int oldIndex) override {
    m_designer.ControlRenamed(control, oldName, oldIndex);
  }
  // The project identity and info files. A project's entry follows the project object, so a rename
  // changes nothing.
  void projectAdded(const ide::Ref<ide::VBProject>& project) override { m_projInfos.projectAdded(project); }
  void projectRemoved(const ide::Ref<ide::VBProject>& project) override {
    m_projInfos.projectRemoved(project);
  }
  void projectRenamed(const ide::Ref<ide::VBProject>&, const QString&) override {}
  void projectFileMoved(const ide::Ref<ide::VBProject>& project, const QString& newName,
                        const QString&) override {
    m_projInfos.projectFileMoved(project, newName);
  }
  bool isIdentityModule(const ide::Ref<ide::VBComponent>& component) override {
    return m_projInfos.isIdentityModule(component);
  }
  void allProjectsClosed() override { m_projInfos.closeAll(); }
  void projectsStayOpen() override { m_projInfos.detachAll(); }
  void componentRemoved(const ide::Ref<ide::VBComponent>& component) override {
    m_projInfos.componentRemoved(component);
  }
  void componentRenamed(const ide::Ref<ide::VBComponent>& component, const QString&) override {
    m_projInfos.componentRenamed(component);
  }

 private:
  static projinfo::ProjInfoServices projInfoServices(const FeatureServices& services) {
    projinfo::ProjInfoServices result;
    result.vbe = services.vbe.get();
    result.appInfo = services.appInfo;
    result.appInfoUnavailable = services.appInfoUnavailable;
    result.createFavorites = [](projinfo::CProjInfo& info) -> std::unique_ptr<projinfo::InfoRecordList> {
      return std::make_unique<navigation::CFavorites>(
          info, [](navigation::CFavorites& favorites) { navigation::showFavorites(favorites); });
    };
    result.showTasks = [](projinfo::CTaskList& tasks) { projinfo::showTaskList(tasks); };
    return result;
  }

  QWidget* dialogParent() const { return qobject_cast<QWidget*>(m_vbe->Platform().ui().dialogParent()); }
  /// The info object of the active project, when its file is open; else the user is told why not.
  projinfo::CProjInfo* activeInfo() {
    projinfo::CProjInfo* info = m_projInfos.item(m_vbe->ActiveVBProject());
    if (info && !info->isOpen()) {
      tell(info->unavailable());
      return nullptr;
    }
    return info;
  }
  void tell(const QString& text, int icon = ide::mb::Exclamation) {
    if (!text.isEmpty()) m_vbe->Platform().ui().MsgBox(text, icon, common::title());
  }

  ide::Ref<ide::VBE> m_vbe;
  common::SettingsStore& m_settings;
  FeatureServices m_services;
  common::Options& m_options;
  TextTools m_textTools;
  projinfo::ProjInfos m_projInfos;
  QPointer<find::frmFind> m_findForm;
  designer::DesignerActions m_designer;
};

void AddInFeatures::showExtendedFind() {
  if (!m_findForm) m_findForm = new find::frmFind(m_vbe, dialogParent());
  // The code window's selection is the text to look for.
  QString selected;
  try {
    selected = CEnvUtils(*m_vbe).GetSelectedText();
  } catch (const std::exception& failure) {
    // The window opens without a text to look for.
    common::logFailure(failure, QStringLiteral("AddInFeatures"), QStringLiteral("showExtendedFind"),
                       __LINE__);
  }
  m_findForm->Show(selected);
}

void AddInFeatures::showNewProcedure() {
  ide::VBE& vbe = *m_vbe;
  const QString installDir = m_services.installDir;
  newproc::showNewProcedureDialog(
      {m_vbe, m_settings, m_services.appInfo, m_services.appInfoUnavailable, m_services.textInsertion,
       [&vbe] { return CEnvUtils(vbe).IdeMode() == ide::IdeMode::Run; },
       [&vbe, installDir] {
         ide::UserInterface& ui = vbe.Platform().ui();
         if (!showHelpTopic(ui, installDir, 11))
           ui.MsgBox(QString::fromUtf16(kHelpNotFound), ide::mb::Information, common::title());
       }},
      dialogParent());
}

}  // namespace

std::unique_ptr<Features> createFeatures(const FeatureServices& services) {
  return std::make_unique<AddInFeatures>(services);
}

}  // namespace addin
