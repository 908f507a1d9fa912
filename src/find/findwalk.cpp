// SPDX-License-Identifier: MIT
#include "find/findwalk.h"

#include "common/errors.h"
#include "common/strings.h"
#include "find/texts.h"
#include "syntax/text.h"

#include <algorithm>

namespace find {

bool FindWalk::stillOpen(const ide::Ref<ide::VBProject>& project,
                         const ide::Ref<ide::VBComponent>& component) {
  try {
    // Asked after every yield: the component's own tie first, then the projects without copying them.
    if (component && component->Collection()->Parent() != project) return false;
    const auto projects = m_vbe.VBProjects();
    for (int i = projects->Count(); i >= 1; --i)
      if (projects->Item(i) == project) return true;
  } catch (const std::exception&) {
    // A removed component belongs to no project any more.
  }
  return false;
}

void FindWalk::Search(SearchScope scope, const FindOptions& options) {
  m_rows = 0;
  switch (scope) {
    case SearchScope::AllProjects:
      for (const auto& project : m_vbe.VBProjects()->items()) {
        if (m_context.cancelled()) return;
        if (!stillOpen(project)) continue;  // removed while an earlier one was searched
        m_report.status(common::LoadResString(kSearching));
        m_report.resultsLabel(common::LoadResString(kResultsIn) + u' ' + project->Name());
        searchProject(project, options);
      }
      return;
    case SearchScope::ActiveProject: {
      const auto project = walk::activeProject(m_vbe);
      m_report.resultsLabel(common::LoadResString(kResultsIn) + u' ' + project->Name());
      searchProject(project, options);
      return;
    }
    case SearchScope::ActiveModule: {
      const auto project = walk::activeProject(m_vbe);
      if (m_context.yieldAndCheck()) return;
      ide::Ref<ide::CodeModule> module;
      try {
        // No selected component, or one without code (a related document), is nothing to search.
        const auto component = m_vbe.SelectedVBComponent();
        if (component && component->Type() != ide::ComponentType::RelatedDocument)
          module = component->CodeModule();
      } catch (const std::exception& failure) {
        // Nothing to search: the selected component went meanwhile.
        common::logFailure(failure, QStringLiteral("FindWalk"), QStringLiteral("Search"), __LINE__);
      }
      if (module && stillOpen(project, module->Parent())) searchModule(project, module, options);
      m_report.resultsLabel(common::LoadResString(kResultsIn) + u' ' + project->Name());
      return;
    }
  }
}

void FindWalk::searchProject(const ide::Ref<ide::VBProject>& project, const FindOptions& options) {
  // The components as they were when the project's turn came: one removed meanwhile is passed over, and
  // the project's walk ends when the project itself leaves the IDE.
  for (const auto& component : project->VBComponents()->items()) {
    if (m_context.yieldAndCheck() || !stillOpen(project)) return;
    if (!stillOpen(project, component)) continue;
    ide::Ref<ide::CodeModule> module;
    try {
      if (component->Type() != ide::ComponentType::RelatedDocument) module = component->CodeModule();
    } catch (const std::exception&) {
      continue;  // a component that cannot be read is left as it is
    }
    if (module && !searchModule(project, module, options)) return;
  }
}

bool FindWalk::searchModule(const ide::Ref<ide::VBProject>& project, const ide::Ref<ide::CodeModule>& module,
                            const FindOptions& options) {
  const auto component = module->Parent();
  const QString projectName = project->Name();
  const QString moduleName = component->Name();
  m_report.status(common::LoadResString(kSearching) + u' ' + moduleName);
  int line = 1;
  int column = 1;
  for (;;) {
    const int count = module->CountOfLines();
    if (line > count) return true;
    const int stretchEnd = std::min(count, line + (kStretchLines - 1));
    int startLine = line;
    int startColumn = column;
    int endLine = stretchEnd;
    int endColumn = -1;
    if (!module->Find(options.text, startLine, startColumn, endLine, endColumn, options.wholeWord,
                      options.matchCase, options.patternSearch)) {
      if (stretchEnd >= count) return true;
      line = stretchEnd + 1;
      column = 1;
      if (m_context.yieldAndCheck()) return false;
      if (!stillOpen(project, component)) return true;
      continue;
    }
    if (m_context.yieldAndCheck()) return false;
    // What the loop ran may have taken the module or its project out of the IDE.
    if (!stillOpen(project, component)) return true;
    ide::ProcKind kind = ide::ProcKind::Proc;
    QString procedure = module->ProcOfLine(startLine, kind);
    if (procedure.isEmpty()) procedure = walk::declarationsText();
    const QString lineText = module->Lines(startLine, 1);
    m_report.found(FoundRow{projectName, moduleName, std::move(procedure),
                            syntax::trimmedView(lineText).toString(),
                            CItemFound{project, component, startLine, startColumn, endLine, endColumn}});
    ++m_rows;
    // One character after the start of this occurrence, so that overlapping ones are listed too.
    line = startLine;
    column = startColumn + 1;
  }
}

}  // namespace find
