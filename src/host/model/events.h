// SPDX-License-Identifier: MIT
// Hands out the IDE's event sources: IDE-wide ones, those of a project and those of a form designer.
#pragma once

#include "ide/vbide.h"

#include <map>
#include <memory>

namespace host {

class VbeImpl;
class FormImpl;

class EventsImpl final : public ide::Events {
 public:
  EventsImpl();

  ide::Ref<ide::ProjectsEventSource> VBProjectsEvents() override { return projects; }
  ide::Ref<ide::ComponentsEventSource> VBComponentsEvents(const ide::Ref<ide::VBProject>& project) override;
  ide::Ref<ide::ReferencesEventSource> ReferencesEvents(const ide::Ref<ide::VBProject>& project) override;
  ide::Ref<ide::FileControlEventSource> FileControlEvents(const ide::Ref<ide::VBProject>& project) override;
  ide::Ref<ide::ControlsEventSource> VBControlsEvents(const ide::Ref<ide::VBProject>& project,
                                                      const ide::Ref<ide::VBForm>& form) override;
  ide::Ref<ide::SelectedControlsEventSource> SelectedVBControlsEvents(
      const ide::Ref<ide::VBProject>& project, const ide::Ref<ide::VBForm>& form) override;
  ide::Ref<ide::CommandBarEventSource> CommandBarEvents(
      const ide::Ref<ide::CommandBarControl>& control) override;

  /// The sources of one form designer (made on first use).
  std::shared_ptr<ide::ControlsEventSource> formControlEvents(const FormImpl* form);
  std::shared_ptr<ide::SelectedControlsEventSource> formSelectedControlEvents(const FormImpl* form);
  /// A form left the IDE: its sources go.
  void forgetForm(const FormImpl* form);

  // The IDE-wide sources.
  const std::shared_ptr<ide::ProjectsEventSource> projects;
  const std::shared_ptr<ide::ComponentsEventSource> components;
  const std::shared_ptr<ide::ReferencesEventSource> references;
  const std::shared_ptr<ide::FileControlEventSource> files;
  const std::shared_ptr<ide::ControlsEventSource> controls;
  const std::shared_ptr<ide::SelectedControlsEventSource> selectedControls;

 private:
  std::map<const FormImpl*, std::shared_ptr<ide::ControlsEventSource>> m_formControls;
  std::map<const FormImpl*, std::shared_ptr<ide::SelectedControlsEventSource>> m_formSelected;
};

}  // namespace host
