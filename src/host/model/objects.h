// SPDX-License-Identifier: MIT
// The objects of the IDE model. They know each other closely (a code module tells its pane about edits, a
// component fires its project's events ...), so they are declared together; each part is implemented in
// its own file. Objects hold their owners weakly: an object that has left the IDE (a removed component,
// a closed project) stays valid for whoever still holds it, and its operations that need the IDE fail with
// error 91.
#pragma once

#include "fileio/fileio.h"
#include "host/code/codetext.h"
#include "host/files/modulefile.h"
#include "host/files/projectfile.h"
#include "ide/vbide.h"

#include <QString>

#include <functional>
#include <memory>
#include <optional>
#include <vector>

namespace host {

class VbeImpl;
class ProjectImpl;
class ComponentImpl;
class CodeModuleImpl;
class CodePaneImpl;
class WindowImpl;
class FormImpl;
class ControlImpl;

// ---------------------------------------------------------------------------------------------------
// Windows and panes

/// Files to write together (see FileWriteBatch), with what to do for each once the batch is over: a
/// component or project notes what it saved and the file event is fired.
struct SaveBatch {
  /// Told the file's new stamp, or null when the file does not hold its new content.
  using Done = std::function<void(const fileio::FileStamp* written)>;
  SaveBatch();
  ~SaveBatch();
  void add(fileio::FileWriteBatch::File file, Done done);
  /// Several files at once, written side by side.
  void addAll(std::vector<fileio::FileWriteBatch::File> files, std::vector<Done> done);
  /// Commits the files, then runs every `done`, also when the commit fails (which is thrown then).
  void commit();

  std::unique_ptr<fileio::FileWriteBatch> files;
  std::vector<Done> done;
};

/// The stamp of what was read from `path`, when `stamp` was taken of that path.
std::optional<fileio::FileStamp> stampFor(const std::optional<fileio::FileStamp>& stamp, const QString& path);
/// Takes a new stamp when `stamp` is one of `paths` (the user chose to overwrite what is there now).
void restampIfListed(std::optional<fileio::FileStamp>& stamp, const QStringList& paths);

/// The kind of file a component is kept in, as file events report it.
ide::FileType fileTypeOf(ide::ComponentType type);

/// The IDE's name of a component type ("Module", "Class", "Form", "UserControl" ...): the prefix of new
/// components' names, and what a designer window's caption ends with.
QString componentTypeName(ide::ComponentType type);

class WindowImpl final : public ide::Window, public std::enable_shared_from_this<WindowImpl> {
 public:
  WindowImpl(const std::shared_ptr<VbeImpl>& vbe, ide::WindowType type, std::function<QString()> caption,
             QString className);
  ~WindowImpl() override;

  QString Caption() override { return m_caption ? m_caption() : QString(); }
  ide::HWnd hWnd() override { return m_hwnd; }
  ide::WindowType Type() override { return m_type; }
  ide::WindowState WindowState() override { return m_state; }
  void setWindowState(ide::WindowState state) override;
  bool Visible() override { return m_hwnd != 0 && m_visible; }
  void setVisible(bool visible) override;
  void SetFocus() override;
  void Close() override;

  /// Creates the window in the window system if it is not open.
  void open();
  bool isOpen() const { return m_hwnd != 0; }
  std::shared_ptr<ComponentImpl> component() const { return m_component.lock(); }
  void setComponent(const std::shared_ptr<ComponentImpl>& component) { m_component = component; }
  std::shared_ptr<CodePaneImpl> pane() const { return m_pane.lock(); }
  void setPane(const std::shared_ptr<CodePaneImpl>& pane) { m_pane = pane; }
  /// Told when the window opens, closes, changes state or visibility (the desktop host follows it).
  ide::Signal<WindowImpl*> changed;

 private:
  qintptr ownProc(ide::HWnd hwnd, unsigned message, quintptr wParam, qintptr lParam);

  std::weak_ptr<VbeImpl> m_vbe;
  ide::WindowType m_type;
  std::function<QString()> m_caption;
  QString m_className;
  ide::HWnd m_hwnd = 0;
  ide::WindowState m_state = ide::WindowState::Normal;
  bool m_visible = true;
  std::weak_ptr<ComponentImpl> m_component;
  std::weak_ptr<CodePaneImpl> m_pane;
};

class CodePaneImpl final : public ide::CodePane, public std::enable_shared_from_this<CodePaneImpl> {
 public:
  explicit CodePaneImpl(const std::shared_ptr<CodeModuleImpl>& module);

  ide::Ref<ide::CodeModule> CodeModule() override;
  ide::Ref<ide::Window> Window() override;
  int TopLine() override { return m_topLine; }
  void setTopLine(int line) override;
  int CountOfVisibleLines() override { return m_visibleLines; }
  void GetSelection(int& startLine, int& startColumn, int& endLine, int& endColumn) override;
  void SetSelection(int startLine, int startColumn, int endLine, int endColumn) override;
  void Show() override;

  struct Selection {
    int startLine = 1, startColumn = 1, endLine = 1, endColumn = 1;
  };
  const Selection& selection() const { return m_selection; }
  std::shared_ptr<WindowImpl> window();
  /// What the view (the desktop host's editor, or a test) reports: scrolling, caret, visible height.
  /// These do not announce `viewRequest`, which is for requests coming from the object model.
  void viewScrolled(int topLine);
  void viewSelectionChanged(const Selection& selection);
  void setCountOfVisibleLines(int lines);
  /// Keeps the selection on its text when lines above it are inserted or deleted.
  void linesChanged(int firstLine, int removed, int inserted);
  /// The object model moved the view (TopLine or SetSelection): the view should follow.
  ide::Signal<CodePaneImpl*> viewRequest;

 private:
  std::weak_ptr<CodeModuleImpl> m_module;
  std::shared_ptr<WindowImpl> m_window;
  int m_topLine = 1;
  int m_visibleLines = 40;
  Selection m_selection;
};

// ---------------------------------------------------------------------------------------------------
// Code

class CodeModuleImpl final : public ide::CodeModule,
                             public std::enable_shared_from_this<CodeModuleImpl>,
                             private CodeText::Listener {
 public:
  explicit CodeModuleImpl(const std::shared_ptr<ComponentImpl>& component);
  ~CodeModuleImpl() override;

  ide::Ref<ide::VBComponent> Parent() override;
  QString Name() override;
  ide::Ref<ide::CodePane> CodePane() override;
  ide::Ref<ide::Members> Members() override;
  QString Lines(int startLine, int count) override { return text().lines(startLine, count); }
  int CountOfLines() override { return text().countOfLines(); }
  int CountOfDeclarationLines() override { return text().countOfDeclarationLines(); }
  void InsertLines(int line, const QString& text) override;
  void DeleteLines(int startLine, int count) override;
  void ReplaceLine(int line, const QString& text) override;
  void AddFromString(const QString& text) override;
  int ProcStartLine(const QString& procName, ide::ProcKind kind) override;
  int ProcBodyLine(const QString& procName, ide::ProcKind kind) override;
  int ProcCountLines(const QString& procName, ide::ProcKind kind) override;
  QString ProcOfLine(int line, ide::ProcKind& kind) override { return text().procOfLine(line, kind); }
  std::vector<ide::ProcExtent> Procedures() override { return text().procedureExtents(); }
  bool Find(const QString& target, int& startLine, int& startColumn, int& endLine, int& endColumn,
            bool wholeWord, bool matchCase, bool patternSearch) override;

  /// Code read from a file and not split into lines yet: the file's bytes from `offset` on, which is
  /// line `firstLine` (0-based) of the file.
  struct Unread {
    QByteArray bytes;
    qsizetype offset = 0;
    int firstLine = 0;
    QString fileName;
  };
  /// Takes the code of a file, split into lines.
  void load(std::vector<SourceLine> code, std::vector<MemberAttributeLine> attributes);
  /// Takes the code of a file as bytes, split into lines when first used: a tool that works on one
  /// module after the other then holds the lines of those it is working on only.
  void loadLater(Unread code);
  /// Frees the lines, made again when next used from `code` (the module as it stands, in file form), or
  /// without it from the bytes they were made from while no edit changed them. Not with a code pane,
  /// which shows the lines; false when nothing was freed.
  bool unload(std::optional<Unread> code = std::nullopt);
  bool isLoaded() const { return !m_unread; }

  CodeText& text() {
    if (m_unread) readUnread();
    return m_text;
  }
  /// Grows with every edit (not with reading the code or freeing its lines).
  quint64 changeCount() const;
  std::shared_ptr<ComponentImpl> component() const { return m_component.lock(); }
  std::shared_ptr<CodePaneImpl> pane();
  bool hasPane() const { return m_pane != nullptr; }

 private:
  void linesChanged(int firstLine, int removed, int inserted) override;
  void checkEditable();
  /// As checkEditable, and error 40198 while the program runs.
  void checkWritable();

  void readUnread();

  std::weak_ptr<ComponentImpl> m_component;
  CodeText m_text;
  std::optional<Unread> m_unread;
  std::optional<Unread> m_madeFrom;  // what the lines were made from, until an edit
  quint64 m_editsBefore = 0;         // edits counted before the lines were last made
  quint64 m_madeAt = 0;              // the text's change count when they were made
  std::shared_ptr<CodePaneImpl> m_pane;
};

// ---------------------------------------------------------------------------------------------------
// Components

class ComponentImpl final : public ide::VBComponent, public std::enable_shared_from_this<ComponentImpl> {
 public:
  /// A component of the given type whose file is `filePath` (empty for a new one); load() or create() next.
  ComponentImpl(const std::shared_ptr<ProjectImpl>& project, ide::ComponentType type, QString filePath);
  ~ComponentImpl() override;

  QString Name() override { return m_name; }
  void setName(const QString& name) override;
  ide::ComponentType Type() override { return m_type; }
  ide::Ref<ide::CodeModule> CodeModule() override { return m_module; }
  ide::Ref<ide::VBForm> Designer() override;
  ide::Ref<ide::Properties> Properties() override;
  ide::Ref<ide::VBComponents> Collection() override;
  bool Saved() override { return !IsDirty(); }
  bool IsDirty() override;
  QString FileNames(int index) override;
  int FileCount() override;
  void SaveAs(const QString& fileName) override;
  void Activate() override;
  ide::Ref<ide::Window> DesignerWindow() override;

  /// Reads the component's file (module files, or nothing for binary documents), or takes `contents` as
  /// what the file holds (an editor's text not saved yet; the file is not read). Throws ide::Error naming
  /// the file and line for anything unreadable.
  void load(const QByteArray* contents = nullptr);
  /// Sets up a new component of its type, named `name`.
  void create(const QString& name);
  /// Adds the form's binary file to `batch` when a value in it changed.
  void addBinaryToBatch(SaveBatch& batch);
  /// Writes the component's file when it changed (or when `force`), to its path.
  void save(bool force = false);
  /// Adds the component's file to `batch` when it changed (or when `force`).
  void addToBatch(SaveBatch& batch, bool force = false);
  /// What saving would write: the file's bytes, or nothing when it need not be written. Reads only this
  /// component, so that several can be put together at once.
  std::optional<QByteArray> fileContents(bool force = false);
  /// What to do once the batch holding this component's file is done: note it saved, tell the IDE.
  SaveBatch::Done whenWritten();
  /// The file as it was read or last written (to tell whether another program changed it since).
  std::optional<fileio::FileStamp> fileStamp() const { return stampFor(m_stamp, m_filePath); }
  /// The file on disk becomes the one to overwrite, whatever another program did to it.
  void acceptFileOnDisk(const QStringList& paths) {
    restampIfListed(m_stamp, paths);
    restampIfListed(m_binaryStamp, paths);
  }
  QString filePath() const { return m_filePath; }
  void setFilePath(const QString& path) { m_filePath = path; }
  std::shared_ptr<ProjectImpl> project() const { return m_project.lock(); }
  std::shared_ptr<CodeModuleImpl> codeModule() const { return m_module; }
  std::shared_ptr<FormImpl> form();
  ModuleSource& source() { return m_source; }
  /// The designer window (made on first use; empty for components without a designer).
  std::shared_ptr<WindowImpl> designerWindow();
  std::shared_ptr<WindowImpl> designerWindowIfAny() const { return m_designerWindow; }
  /// Closes the component's code and designer windows.
  void closeWindows();
  /// The binary file beside a form (.frx ...), whether it exists or not; empty for other components.
  QString binaryFilePath() const;
  /// The name the form's references give its binary file ("Form1.frx"); for a form that refers to none
  /// yet, the one the IDE gives it after the form's file (or name).
  QString binaryFileName();
  bool hasCode() const { return m_module != nullptr; }
  /// Frees the lines of the module's code until they are next used; edits stay edits. `contents` is the
  /// file as fileContents gave it, when the caller has it. Nothing happens with a code window open, or
  /// when the code as it stands could not be read back (a line grown too long).
  void unloadCode(const QByteArray* contents = nullptr);
  /// The module's file, as last read, is UTF-8 with accented letters although modules are read in the
  /// ANSI code page (a file another editor wrote): worth a warning.
  bool looksLikeUtf8() const { return m_looksLikeUtf8; }
  bool hasDesigner() const { return m_source.form.has_value(); }
  void markChanged() { m_changed = true; }
  /// Left the IDE: removed from its project or its project closed.
  void detach();
  bool attached() const { return !m_project.expired(); }

 private:
  /// Takes the module file `bytes` as the component's header and code.
  void adopt(const QByteArray& bytes, const QString& fileName);
  /// Reads the binary file the form refers to, when there is one (a missing one leaves the references).
  void loadBinary();
  /// Where the binary file is written: beside the form's file, under the name its references give it.
  QString binaryWritePath();

  std::weak_ptr<ProjectImpl> m_project;
  ide::ComponentType m_type;
  QString m_filePath;
  QString m_name;
  ModuleSource m_source;
  std::shared_ptr<CodeModuleImpl> m_module;
  std::shared_ptr<FormImpl> m_form;
  std::shared_ptr<WindowImpl> m_designerWindow;
  quint64 m_savedChangeCount = 0;
  bool m_changed = false;  // header, form or name changed since the last save
  bool m_looksLikeUtf8 = false;
  std::optional<fileio::FileStamp> m_stamp;
  std::optional<fileio::FileStamp> m_binaryStamp;  // the form's binary file as read or last written
};

/// Adds the files of several components to `batch`, put together side by side.
void addToBatch(SaveBatch& batch, const std::vector<std::shared_ptr<ComponentImpl>>& components,
                bool force = false);

// ---------------------------------------------------------------------------------------------------
// Projects

/// A file that a project or group file lists but that was not there when it was opened. Nothing is loaded
/// for it, and its entry stays in the file as it was.
struct MissingFile {
  QString listedIn;  // the project or group file
  int line = 0;      // the entry's line there (1-based)
  QString entry;     // the path as the entry writes it
};

class ProjectImpl final : public ide::VBProject,
                          public ide::VBComponents,
                          public std::enable_shared_from_this<ProjectImpl> {
 public:
  explicit ProjectImpl(const std::shared_ptr<VbeImpl>& vbe);
  ~ProjectImpl() override;

  // ide::VBProject
  QString Name() override { return m_name; }
  void setName(const QString& name) override;
  QString FileName() override { return m_fileName; }
  ide::ProjectType Type() override { return m_type; }
  QString Description() override;
  ide::Ref<ide::VBComponents> VBComponents() override;
  ide::Ref<ide::References> References() override;
  ide::Ref<ide::VBProjects> Collection() override;
  bool Saved() override;
  void SaveAs(const QString& fileName) override;

  // ide::VBComponents
  int Count() override { return static_cast<int>(m_components.size()); }
  ide::Ref<ide::VBComponent> Item(int index) override;
  ide::Ref<ide::VBComponent> Item(const QString& name) override;
  ide::Ref<ide::VBProject> Parent() override { return shared_from_this(); }
  ide::Ref<ide::VBComponent> Add(ide::ComponentType type) override;
  ide::Ref<ide::VBComponent> AddFile(const QString& fileName) override;
  void Remove(const ide::Ref<ide::VBComponent>& component) override;

  /// Reads a project file and every file it lists; throws ide::Error naming the file and line.
  void load(const QString& fileName);
  /// Sets up a new, unsaved project.
  void create(ide::ProjectType type, const QString& name);
  /// Writes every changed component and the project file (when changed) to their paths.
  void save();
  /// Adds what save() writes to `batch`.
  void addToBatch(SaveBatch& batch);
  const std::vector<std::shared_ptr<ComponentImpl>>& components() const { return m_components; }
  std::shared_ptr<ComponentImpl> component(const QString& name) const;
  std::shared_ptr<VbeImpl> vbe() const { return m_vbe.lock(); }
  /// The project's directory (for a never-saved project, empty).
  QString directory() const;
  /// A free name "<prefix>N" among the components.
  QString freeComponentName(const QString& prefix) const;
  /// Checks a new component name: error 35011 for an invalid one, 35010 for one in use.
  void checkComponentName(const QString& name, const ComponentImpl* except) const;
  /// The project file entry of a component changed (its name or path).
  void componentEntryChanged(ComponentImpl& component, const QString& oldName);
  /// Adds an existing module file; `announce` fires the component's addition (not while opening).
  std::shared_ptr<ComponentImpl> addExistingFile(const QString& path, bool announce,
                                                 const QByteArray* contents = nullptr);
  /// Left the IDE (closed): its operations that need the IDE fail from now on.
  void detach();
  /// The files the project file listed that were missing when it was loaded, in file order.
  const std::vector<MissingFile>& missingFiles() const { return m_missing; }
  /// The files of `paths` (the project file, its components' files) become the ones to overwrite,
  /// whatever another program did to them.
  void acceptFilesOnDisk(const QStringList& paths);

  // Event sources of this project (the IDE-wide ones are fired alongside by the VBE).
  std::shared_ptr<ide::ComponentsEventSource> componentEvents;
  std::shared_ptr<ide::ReferencesEventSource> referenceEvents;
  std::shared_ptr<ide::FileControlEventSource> fileEvents;
  std::shared_ptr<ide::ControlsEventSource> controlEvents;
  std::shared_ptr<ide::SelectedControlsEventSource> selectedControlEvents;

 private:
  QString componentEntryPath(const ComponentImpl& component) const;
  void addComponentEntry(ComponentImpl& component);
  int indexOf(const ComponentImpl& component) const;
  /// The index among the project file's component entries of the component at `index` (the entries of
  /// missing files have no component).
  int entryIndexOf(int index) const;
  /// Gives new components a file in `dir`, named after them.
  void assignFilePaths(const QString& dir);

  std::weak_ptr<VbeImpl> m_vbe;
  QString m_fileName;
  QString m_name;
  ide::ProjectType m_type = ide::ProjectType::StandardExe;
  std::optional<ProjectFile> m_file;
  std::vector<std::shared_ptr<ComponentImpl>> m_components;
  std::vector<MissingFile> m_missing;
  /// One per component entry of the project file, in file order: whether its file was missing.
  std::vector<bool> m_entryMissing;
  bool m_changed = false;
  bool m_detached = false;
  std::optional<fileio::FileStamp> m_stamp;
};

}  // namespace host
