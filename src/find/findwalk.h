// SPDX-License-Identifier: MIT
// The extended find's search without its window: the components of the chosen scope, searched one after
// the other with the code module's Find (whole word, match case and wildcards are the IDE's), one row per
// occurrence, overlapping ones included. The walk yields to the IDE's loop before each component, after each
// occurrence and between stretches of a long module, and ends at the first yield after a cancel.
#pragma once

#include "find/itemfound.h"
#include "walk/walk.h"

#include <QString>

namespace find {

/// The option buttons OpSearch(1) to OpSearch(3).
enum class SearchScope : int { AllProjects = 1, ActiveProject = 2, ActiveModule = 3 };

struct FindOptions {
  QString text;
  bool wholeWord = false;
  bool matchCase = false;
  bool patternSearch = false;
};

/// A row of the result list: its four columns and the occurrence it leads to.
struct FoundRow {
  QString project;
  QString module;
  /// "(Declarations)" outside any procedure.
  QString procedure;
  /// The occurrence's line without its leading and trailing blanks.
  QString text;
  CItemFound item;
};

/// Where the search shows how it goes.
class FindReport {
 public:
  virtual ~FindReport() = default;
  /// The status bar's first panel.
  virtual void status(const QString& text) = 0;
  /// The label over the list.
  virtual void resultsLabel(const QString& text) = 0;
  virtual void found(FoundRow row) = 0;
};

class FindWalk {
 public:
  /// The lines one Find call covers at most: a module without occurrences is still searched in stretches
  /// short enough for the IDE to stay responsive between them.
  static constexpr int kStretchLines = 4096;

  FindWalk(walk::WalkContext& context, ide::VBE& vbe, FindReport& report)
      : m_context(context), m_vbe(vbe), m_report(report) {}

  /// Searches the scope. A failure (no active project, a pattern Find refuses, a module that fails
  /// half-way) ends the search and is thrown; the rows reported so far stay reported.
  void Search(SearchScope scope, const FindOptions& options);

  /// The rows reported by the last search.
  int rows() const { return m_rows; }

 private:
  /// The project is still open, and the component (when given) still one of its components.
  bool stillOpen(const ide::Ref<ide::VBProject>& project, const ide::Ref<ide::VBComponent>& component = {});
  void searchProject(const ide::Ref<ide::VBProject>& project, const FindOptions& options);
  /// False when the search was cancelled inside the module.
  bool searchModule(const ide::Ref<ide::VBProject>& project, const ide::Ref<ide::CodeModule>& module,
                    const FindOptions& options);

  walk::WalkContext& m_context;
  ide::VBE& m_vbe;
  FindReport& m_report;
  int m_rows = 0;
};

}  // namespace find
