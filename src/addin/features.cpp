// SPDX-License-Identifier: MIT
// The one place that says what each feature area does today. Numbering, indentation and the new-procedure
// wizard open their dialogs. Every other area is not part of the add-in yet: its command and its events are
// connected and arrive here, and do nothing until the area lands; no stand-in dialog pretends to be the
// feature meanwhile.
#include "addin/features.h"

#include "addin/envutils.h"
#include "addin/help.h"
#include "addin/texts.h"
#include "common/settings.h"
#include "common/strings.h"
#include "newproc/frmnewproc.h"
#include "transform/dialogs.h"

#include <QWidget>

namespace addin {
namespace {

class AddInFeatures final : public Features {
 public:
  explicit AddInFeatures(const FeatureServices& services)
      : m_vbe(services.vbe), m_settings(services.settings), m_services(services) {}

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
  // Not there yet: the extended find.
  void showExtendedFind() override {}
  void findWindowProjectRemoved(const ide::Ref<ide::VBProject>&) override {}
  void findWindowComponentRemoved(const ide::Ref<ide::VBComponent>&) override {}
  // Not there yet: the task list.
  void showTaskList() override {}
  void showNewProcedure() override;
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
  FeatureServices m_services;
};

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
