// SPDX-License-Identifier: MIT
// The IDE's extensibility object model as the add-in sees it. Names follow the IDE's own (VBProjects,
// CodeModule, ProcStartLine ...), properties are read as Name() and written as setName(); line and column
// numbers are 1-based; every failure throws ide::Error. Collections are 1-based like the IDE's.
//
// Inside these classes the object types are written with their namespace (ide::Window), because member
// functions carry the same names as the types they return.
#pragma once

#include "ide/commandbars.h"
#include "ide/error.h"
#include "ide/platform.h"
#include "ide/signal.h"
#include "ide/types.h"

#include <QString>
#include <QVariant>

#include <optional>
#include <vector>

namespace ide {

class VBE;
class VBProjects;
class VBProject;
class VBComponents;
class VBComponent;
class CodeModule;
class Members;
class Member;
class CodePane;
class CodePanes;
class Window;
class Windows;
class VBForm;
class VBControls;
class VBControl;
class Properties;
class Property;
class References;
class Reference;
class Events;
class AddIns;
class AddIn;

/// A read-only, 1-based collection.
template <class T>
class Collection {
 public:
  virtual ~Collection() = default;
  virtual int Count() = 0;
  /// Item 1 to Count; error 9 otherwise.
  virtual Ref<T> Item(int index) = 0;
  /// A snapshot of the items in order.
  std::vector<Ref<T>> items() {
    std::vector<Ref<T>> result;
    const int n = Count();
    result.reserve(static_cast<size_t>(n));
    for (int i = 1; i <= n; ++i)
      result.push_back(Item(i));
    return result;
  }
};

// ---------------------------------------------------------------------------------------------------
// Properties of components and controls

class Property {
 public:
  virtual ~Property() = default;
  virtual QString Name() = 0;
  /// The value in its own type (string, 16- or 32-bit integer, single, double, Boolean ...).
  virtual QVariant Value() = 0;
  /// Converts `value` to the property's type; error 380 ("Invalid property value") when it cannot.
  virtual void setValue(const QVariant& value) = 0;
};

class Properties : public Collection<Property> {
 public:
  using Collection<Property>::Item;
  /// By name, case-insensitive; error 9 when the object has no such property.
  virtual Ref<Property> Item(const QString& name) = 0;
};

// ---------------------------------------------------------------------------------------------------
// Code

class Member {
 public:
  virtual ~Member() = default;
  virtual QString Name() = 0;
  virtual MemberType Type() = 0;
  virtual ide::Scope Scope() = 0;
  virtual bool Static() = 0;
  /// The line of the member's declaration (for a procedure, its first procedure line).
  virtual int CodeLocation() = 0;
  /// The procedure identifier (the file's VB_UserMemId attribute); 0 makes the member the default member
  /// of its class. Empty when the member has none.
  virtual std::optional<int> ProcedureId() = 0;
  virtual void setProcedureId(std::optional<int> id) = 0;
  virtual QString Description() = 0;
  virtual void setDescription(const QString& text) = 0;
};

class Members : public Collection<Member> {
 public:
  using Collection<Member>::Item;
  /// By name, case-insensitive; error 9 when there is none.
  virtual Ref<Member> Item(const QString& name) = 0;
  virtual Ref<ide::CodeModule> Parent() = 0;
};

/// A procedure at its place in a module, with the lines ProcStartLine, ProcBodyLine and ProcCountLines
/// give for it.
struct ProcExtent {
  QString name;
  ProcKind kind = ProcKind::Proc;
  int startLine = 0;
  int bodyLine = 0;
  /// The header's last line: its continuation lines, and the alternative headers that conditional
  /// compilation may give one procedure (#If ... #Else ... #End If around its header lines).
  int headerEnd = 0;
  int countLines = 0;

  bool operator==(const ProcExtent&) const = default;
};

/// The code of a component: the text the code window shows, without the file header and the hidden
/// attributes. Stays the same object while its component is open.
class CodeModule {
 public:
  virtual ~CodeModule() = default;

  virtual Ref<VBComponent> Parent() = 0;
  virtual QString Name() = 0;
  virtual Ref<ide::CodePane> CodePane() = 0;
  virtual Ref<ide::Members> Members() = 0;

  /// `count` lines from `startLine`, joined by CRLF, without a trailing line end.
  virtual QString Lines(int startLine, int count) = 0;
  virtual int CountOfLines() = 0;
  /// The last line of the declarations section (0 when the module has none).
  virtual int CountOfDeclarationLines() = 0;

  /// Inserts the lines of `text` (separated by CRLF, CR or LF) before `line`; CountOfLines + 1 appends.
  virtual void InsertLines(int line, const QString& text) = 0;
  virtual void DeleteLines(int startLine, int count = 1) = 0;
  /// Replaces one line; a text holding line ends becomes several lines.
  virtual void ReplaceLine(int line, const QString& text) = 0;
  /// Appends the text (the IDE's AddFromString, which also works on an empty module).
  virtual void AddFromString(const QString& text) = 0;

  /// First line of a procedure: the line after the previous procedure (or after the declarations).
  virtual int ProcStartLine(const QString& procName, ProcKind kind) = 0;
  /// The line of the Sub, Function or Property statement.
  virtual int ProcBodyLine(const QString& procName, ProcKind kind) = 0;
  virtual int ProcCountLines(const QString& procName, ProcKind kind) = 0;
  /// The procedure that owns `line` and its kind; "" and Proc in the declarations section.
  virtual QString ProcOfLine(int line, ProcKind& kind) = 0;
  /// Every procedure in line order, each with its own extent. The lookups by name above answer with the
  /// first procedure of a name and kind, as the IDE does; this list holds the others too, such as two
  /// procedures of one name in alternative branches of conditional compilation. Declare statements are
  /// not procedures.
  virtual std::vector<ProcExtent> Procedures() = 0;

  /// Searches forward from (startLine, startColumn) to (endLine, endColumn) inclusive; -1 ends mean the
  /// end of the module or line. On success the four positions are set to the match, the end column one
  /// past its last character.
  virtual bool Find(const QString& target, int& startLine, int& startColumn, int& endLine, int& endColumn,
                    bool wholeWord = false, bool matchCase = false, bool patternSearch = false) = 0;
};

class Window {
 public:
  virtual ~Window() = default;
  virtual QString Caption() = 0;
  virtual HWnd hWnd() = 0;
  virtual WindowType Type() = 0;
  virtual ide::WindowState WindowState() = 0;
  virtual void setWindowState(ide::WindowState state) = 0;
  virtual bool Visible() = 0;
  virtual void setVisible(bool visible) = 0;
  virtual void SetFocus() = 0;
  virtual void Close() = 0;
};

class Windows : public Collection<Window> {};

class CodePane {
 public:
  virtual ~CodePane() = default;
  virtual Ref<ide::CodeModule> CodeModule() = 0;
  virtual Ref<ide::Window> Window() = 0;
  virtual int TopLine() = 0;
  /// Scrolls; a line past the end becomes the last line; below 1 is error 5.
  virtual void setTopLine(int line) = 0;
  virtual int CountOfVisibleLines() = 0;
  /// The selection (start before end); the end column is exclusive, an empty selection is the caret.
  virtual void GetSelection(int& startLine, int& startColumn, int& endLine, int& endColumn) = 0;
  /// Places the selection and scrolls it into view.
  virtual void SetSelection(int startLine, int startColumn, int endLine, int endColumn) = 0;
  /// Opens the code window (if needed) and makes it the active one.
  virtual void Show() = 0;
};

class CodePanes : public Collection<CodePane> {};

// ---------------------------------------------------------------------------------------------------
// Forms

class VBControl {
 public:
  virtual ~VBControl() = default;
  virtual QString ClassName() = 0;
  virtual Ref<ide::Properties> Properties() = 0;
  /// The form designer that holds the control.
  virtual Ref<VBForm> Parent() = 0;
  /// The control (form, frame, picture box ...) the control sits in.
  virtual Ref<VBControl> Container() = 0;
  /// "Name" and "Index" through the properties, for convenience.
  QString name() { return Properties()->Item(QStringLiteral("Name"))->Value().toString(); }
};

class VBControls : public Collection<VBControl> {
 public:
  using Collection<VBControl>::Item;
  /// The first control of that name.
  virtual Ref<VBControl> Item(const QString& name) = 0;
  /// Adds an intrinsic control ("VB.TextBox" or "TextBox") to `container` (the form when empty).
  virtual Ref<VBControl> Add(const QString& progId, const Ref<VBControl>& container = {}) = 0;
  virtual void Remove(const Ref<VBControl>& control) = 0;
};

/// A form designer: the form's own control (its root) and the controls on it.
class VBForm {
 public:
  virtual ~VBForm() = default;
  virtual Ref<ide::VBControls> VBControls() = 0;
  virtual Ref<ide::VBControls> SelectedVBControls() = 0;
  virtual Ref<VBControl> Root() = 0;
  virtual Ref<VBComponent> Parent() = 0;
};

// ---------------------------------------------------------------------------------------------------
// Projects and components

class VBComponent {
 public:
  virtual ~VBComponent() = default;
  virtual QString Name() = 0;
  /// Renames; error 35010 for a name in use, 35011 for an invalid one.
  virtual void setName(const QString& name) = 0;
  virtual ComponentType Type() = 0;
  /// Empty for components without code (resource files, related documents).
  virtual Ref<ide::CodeModule> CodeModule() = 0;
  /// The form designer; empty for components without one.
  virtual Ref<VBForm> Designer() = 0;
  virtual Ref<ide::Properties> Properties() = 0;
  virtual Ref<VBComponents> Collection() = 0;
  /// True while the component has no changes that are not saved.
  virtual bool Saved() = 0;
  virtual bool IsDirty() = 0;
  /// The component's files (index 1: the source file, 2: the binary .frx of a form ...).
  virtual QString FileNames(int index) = 0;
  virtual int FileCount() = 0;
  virtual void SaveAs(const QString& fileName) = 0;
  /// Selects and activates the component (opens the designer of a form, else the code window).
  virtual void Activate() = 0;
  virtual Ref<ide::Window> DesignerWindow() = 0;
};

class VBComponents : public Collection<VBComponent> {
 public:
  using Collection<VBComponent>::Item;
  /// By name, case-insensitive; error 9 when there is none.
  virtual Ref<VBComponent> Item(const QString& name) = 0;
  virtual Ref<VBProject> Parent() = 0;
  /// Adds a new component (standard module, class module, form ...), named as the IDE names new ones.
  virtual Ref<VBComponent> Add(ComponentType type) = 0;
  /// Adds an existing file to the project.
  virtual Ref<VBComponent> AddFile(const QString& fileName) = 0;
  virtual void Remove(const Ref<VBComponent>& component) = 0;
};

class Reference {
 public:
  virtual ~Reference() = default;
  virtual QString Name() = 0;
  virtual QString Guid() = 0;
  virtual QString FullPath() = 0;
  virtual QString Description() = 0;
};

class References : public Collection<Reference> {};

class VBProject {
 public:
  virtual ~VBProject() = default;
  virtual QString Name() = 0;
  virtual void setName(const QString& name) = 0;
  /// The project file, always absolute; empty until the project is saved.
  virtual QString FileName() = 0;
  virtual ProjectType Type() = 0;
  virtual QString Description() = 0;
  virtual Ref<ide::VBComponents> VBComponents() = 0;
  virtual Ref<ide::References> References() = 0;
  virtual Ref<VBProjects> Collection() = 0;
  virtual bool Saved() = 0;
  /// Saves the project and its changed components under a new project file name.
  virtual void SaveAs(const QString& fileName) = 0;
};

class VBProjects : public Collection<VBProject> {
 public:
  using Collection<VBProject>::Item;
  virtual Ref<VBProject> Item(const QString& name) = 0;
  /// Opens a project (.vbp) and adds it.
  virtual Ref<VBProject> AddFromFile(const QString& fileName) = 0;
  /// Adds a new, unsaved project.
  virtual Ref<VBProject> Add(ProjectType type) = 0;
  virtual void Remove(const Ref<VBProject>& project) = 0;
};

// ---------------------------------------------------------------------------------------------------
// Events. Each source is an object; a sink connects to the signals it wants.

class ProjectsEventSource {
 public:
  Signal<const Ref<VBProject>&> ItemAdded;
  Signal<const Ref<VBProject>&> ItemRemoved;
  Signal<const Ref<VBProject>&, const QString& /*oldName*/> ItemRenamed;
  Signal<const Ref<VBProject>&> ItemActivated;
};

class ComponentsEventSource {
 public:
  Signal<const Ref<VBComponent>&> ItemAdded;
  Signal<const Ref<VBComponent>&> ItemRemoved;
  Signal<const Ref<VBComponent>&, const QString& /*oldName*/> ItemRenamed;
  Signal<const Ref<VBComponent>&> ItemSelected;
  Signal<const Ref<VBComponent>&> ItemActivated;
  Signal<const Ref<VBComponent>&> ItemReloaded;
};

class ReferencesEventSource {
 public:
  Signal<const Ref<Reference>&> ItemAdded;
  Signal<const Ref<Reference>&> ItemRemoved;
};

class ControlsEventSource {
 public:
  Signal<const Ref<VBControl>&> ItemAdded;
  Signal<const Ref<VBControl>&> ItemRemoved;
  Signal<const Ref<VBControl>&, const QString& /*oldName*/, int /*oldIndex*/> ItemRenamed;
};

class SelectedControlsEventSource {
 public:
  Signal<const Ref<VBControl>&> ItemAdded;
  Signal<const Ref<VBControl>&> ItemRemoved;
};

class FileControlEventSource {
 public:
  Signal<const Ref<VBProject>&, FileType, const QString& /*fileName*/> AfterAddFile;
  Signal<const Ref<VBProject>&, FileType, const QString& /*newName*/, const QString& /*oldName*/>
      AfterChangeFileName;
  Signal<const Ref<VBProject>&, FileType, const QString& /*fileName*/, bool /*wasDirty*/> AfterCloseFile;
  Signal<const Ref<VBProject>&, FileType, const QString& /*fileName*/> AfterRemoveFile;
  /// result: 0 success, 1 cancelled, 2 failed.
  Signal<const Ref<VBProject>&, FileType, const QString& /*fileName*/, int /*result*/> AfterWriteFile;
};

class CommandBarEventSource {
 public:
  Signal<const Ref<CommandBarControl>&, bool& /*handled*/, bool& /*cancelDefault*/> Click;
};

/// Hands out the event sources. A project or form left empty means every project or form.
class Events {
 public:
  virtual ~Events() = default;
  virtual Ref<ProjectsEventSource> VBProjectsEvents() = 0;
  virtual Ref<ComponentsEventSource> VBComponentsEvents(const Ref<VBProject>& project) = 0;
  virtual Ref<ReferencesEventSource> ReferencesEvents(const Ref<VBProject>& project) = 0;
  virtual Ref<FileControlEventSource> FileControlEvents(const Ref<VBProject>& project) = 0;
  virtual Ref<ControlsEventSource> VBControlsEvents(const Ref<VBProject>& project,
                                                    const Ref<VBForm>& form) = 0;
  virtual Ref<SelectedControlsEventSource> SelectedVBControlsEvents(const Ref<VBProject>& project,
                                                                    const Ref<VBForm>& form) = 0;
  virtual Ref<CommandBarEventSource> CommandBarEvents(const Ref<CommandBarControl>& control) = 0;
};

// ---------------------------------------------------------------------------------------------------
// Add-ins

class AddIn {
 public:
  virtual ~AddIn() = default;
  virtual QString ProgId() = 0;
  virtual QString Description() = 0;
  virtual bool Connect() = 0;
  /// true loads and connects the add-in; false disconnects and unloads it.
  virtual void setConnect(bool connect) = 0;
  virtual Ref<ide::VBE> VBE() = 0;
};

class AddIns : public Collection<AddIn> {
 public:
  using Collection<AddIn>::Item;
  /// By ProgId; error 9 when no such add-in is registered.
  virtual Ref<AddIn> Item(const QString& progId) = 0;
};

// ---------------------------------------------------------------------------------------------------
// The IDE

class VBE {
 public:
  virtual ~VBE() = default;
  virtual QString Version() = 0;
  virtual Ref<ide::VBProjects> VBProjects() = 0;
  virtual Ref<ide::CommandBars> CommandBars() = 0;
  virtual Ref<ide::Windows> Windows() = 0;
  virtual Ref<ide::CodePanes> CodePanes() = 0;
  virtual Ref<ide::Events> Events() = 0;
  virtual Ref<AddIns> Addins() = 0;

  virtual Ref<VBProject> ActiveVBProject() = 0;
  virtual void setActiveVBProject(const Ref<VBProject>& project) = 0;
  /// The component selected in the project window; empty when none is.
  virtual Ref<VBComponent> SelectedVBComponent() = 0;
  virtual Ref<Window> MainWindow() = 0;
  virtual Ref<Window> ActiveWindow() = 0;
  /// Empty without a code window.
  virtual Ref<CodePane> ActiveCodePane() = 0;
  virtual void setActiveCodePane(const Ref<CodePane>& pane) = 0;
  virtual ide::DisplayModel DisplayModel() = 0;

  /// The host platform (message loop, windows, user interface): what the IDE's process offers beside the
  /// object model.
  virtual ide::Platform& Platform() = 0;
};

}  // namespace ide
