// SPDX-License-Identifier: MIT
#include "idecommands.h"

#include "addinmanager.h"
#include "codebinding.h"
#include "codeeditor.h"
#include "codewindow.h"
#include "mainwindow.h"
#include "optionsdialog.h"
#include "projectexplorer.h"
#include "qtplatform.h"
#include "windowmanager.h"

#include <QApplication>
#include <QCheckBox>
#include <QDialog>
#include <QDialogButtonBox>
#include <QDir>
#include <QDockWidget>
#include <QFileDialog>
#include <QFileInfo>
#include <QFormLayout>
#include <QLineEdit>
#include <QPlainTextEdit>
#include <QPushButton>
#include <QSettings>
#include <QVBoxLayout>

namespace desktop {
namespace {

const QString kTitle = QStringLiteral("Quimbel IDE");

QString componentFilter(ide::ComponentType type) {
  switch (type) {
    case ide::ComponentType::VBForm:
    case ide::ComponentType::VBMDIForm:
      return QStringLiteral("Form Files (*.frm)");
    case ide::ComponentType::ClassModule:
      return QStringLiteral("Class Files (*.cls)");
    default:
      return QStringLiteral("Basic Files (*.bas)");
  }
}

/// The Find dialog: what to look for and how; Find Next searches the active code window from the caret.
class FindDialog final : public QDialog {
 public:
  FindDialog(const QString& text, QWidget* parent) : QDialog(parent) {
    setObjectName(QStringLiteral("findDialog"));
    setWindowTitle(QStringLiteral("Find"));
    what = new QLineEdit(text, this);
    what->setObjectName(QStringLiteral("findWhat"));
    wholeWord = new QCheckBox(QStringLiteral("Find &Whole Word Only"), this);
    wholeWord->setObjectName(QStringLiteral("wholeWord"));
    matchCase = new QCheckBox(QStringLiteral("&Match Case"), this);
    matchCase->setObjectName(QStringLiteral("matchCase"));
    pattern = new QCheckBox(QStringLiteral("Use &Pattern Matching"), this);
    pattern->setObjectName(QStringLiteral("usePattern"));
    auto* buttons = new QDialogButtonBox(this);
    auto* next = buttons->addButton(QStringLiteral("&Find Next"), QDialogButtonBox::AcceptRole);
    next->setObjectName(QStringLiteral("findNextButton"));
    next->setDefault(true);
    buttons->addButton(QDialogButtonBox::Cancel)->setObjectName(QStringLiteral("cancelButton"));
    auto* form = new QFormLayout;
    form->addRow(QStringLiteral("Fi&nd What:"), what);
    auto* layout = new QVBoxLayout(this);
    layout->addLayout(form);
    layout->addWidget(wholeWord);
    layout->addWidget(matchCase);
    layout->addWidget(pattern);
    layout->addWidget(buttons);
    connect(buttons, &QDialogButtonBox::accepted, this, &QDialog::accept);
    connect(buttons, &QDialogButtonBox::rejected, this, &QDialog::reject);
  }
  QLineEdit* what;
  QCheckBox* wholeWord;
  QCheckBox* matchCase;
  QCheckBox* pattern;
};

}  // namespace

IdeCommands::IdeCommands(MainWindow& window) : QObject(&window), m_window(window) {}

void IdeCommands::run(host::BuiltinCommand command) {
  using B = host::BuiltinCommand;
  auto& vbe = *m_window.vbe();
  try {
    switch (command) {
      case B::NewProject: {
        if (!confirmClose(vbe.projects())) return;
        for (const auto& project : std::vector(vbe.projects()))
          vbe.removeProject(project);
        vbe.newProject();
        if (auto form = addComponent(ide::ComponentType::VBForm)) show(form, false);
        break;
      }
      case B::OpenProject: {
        const QString path = askFileName(
            QStringLiteral("Open Project"),
            QStringLiteral("Project Files (*.vbp *.vbg);;Module Files (*.bas *.cls *.frm);;All Files (*)"),
            {}, false);
        if (!path.isEmpty()) open(path, true);
        break;
      }
      case B::AddProject: {
        vbe.newProject();
        if (auto form = addComponent(ide::ComponentType::VBForm)) show(form, false);
        break;
      }
      case B::RemoveProject:
        if (auto project = currentProject()) closeProject(project);
        break;
      case B::SaveProject:
        saveAll();
        break;
      case B::SaveProjectAs:
        if (auto project = currentProject()) saveProjectAs(project);
        break;
      case B::SaveFile:
        if (auto component = currentComponent()) saveComponent(component, false);
        break;
      case B::SaveFileAs:
        if (auto component = currentComponent()) saveComponent(component, true);
        break;
      case B::Exit:
        m_window.close();
        break;
      case B::Undo:
      case B::Redo:
      case B::Cut:
      case B::Copy:
      case B::Paste:
        editCommand(command);
        break;
      case B::Find:
        find();
        break;
      case B::AddForm:
        if (auto component = addComponent(ide::ComponentType::VBForm)) show(component, false);
        break;
      case B::AddModule:
        if (auto component = addComponent(ide::ComponentType::StdModule)) show(component, true);
        break;
      case B::AddClass:
        if (auto component = addComponent(ide::ComponentType::ClassModule)) show(component, true);
        break;
      case B::RemoveComponent:
        if (auto component = currentComponent()) removeComponent(component);
        break;
      case B::ViewCode:
        if (auto component = currentComponent()) show(component, true);
        break;
      case B::ViewObject:
        if (auto component = currentComponent(); component && component->hasDesigner())
          show(component, false);
        break;
      case B::ViewProjectExplorer:
        m_window.m_explorerDock->show();
        m_window.m_explorerDock->raise();
        m_window.m_explorer->setFocus();
        break;
      case B::ViewProperties:
        m_window.m_propertiesDock->show();
        m_window.m_propertiesDock->raise();
        break;
      case B::ViewToolbox:
        m_window.m_toolboxDock->show();
        m_window.m_toolboxDock->raise();
        break;
      case B::AddInManager:
        showAddInManager();
        break;
      case B::Options: {
        OptionsDialog dialog(m_window.settings(), &m_window);
        dialog.exec();
        break;
      }
      case B::About:
        m_window.ui().MsgBox(
            QStringLiteral("Quimbel IDE %1\n\nA desktop IDE for VB6 projects on Linux, with the "
                           "Quimbel add-in at hand.")
                .arg(QStringLiteral(QUIMBEL_VERSION)),
            ide::mb::OKOnly | ide::mb::Information, QStringLiteral("About Quimbel IDE"));
        break;
      default:
        break;
    }
  } catch (const ide::Error& error) {
    m_window.reportError(error.description());
  }
}

// ---------------------------------------------------------------------------------------------------
// Files and projects

QString IdeCommands::lastDirectory() const {
  if (QSettings* settings = m_window.settings()) {
    const QString dir = settings->value(QStringLiteral("Files/lastDirectory")).toString();
    if (!dir.isEmpty() && QFileInfo(dir).isDir()) return dir;
  }
  return QDir::currentPath();
}

void IdeCommands::rememberDirectory(const QString& path) {
  if (QSettings* settings = m_window.settings())
    settings->setValue(QStringLiteral("Files/lastDirectory"), QFileInfo(path).absolutePath());
}

QString IdeCommands::askFileName(const QString& title, const QString& filter, const QString& suggestion,
                                 bool save) {
  // A Qt dialog rather than the desktop's, so that it looks the same everywhere and scripts can fill it.
  QFileDialog dialog(&m_window, title, lastDirectory(), filter);
  dialog.setObjectName(QStringLiteral("fileDialog"));
  dialog.setOption(QFileDialog::DontUseNativeDialog);
  dialog.setAcceptMode(save ? QFileDialog::AcceptSave : QFileDialog::AcceptOpen);
  dialog.setFileMode(save ? QFileDialog::AnyFile : QFileDialog::ExistingFile);
  if (!suggestion.isEmpty()) dialog.selectFile(suggestion);
  if (dialog.exec() != QDialog::Accepted || dialog.selectedFiles().isEmpty()) return {};
  const QString path = dialog.selectedFiles().front();
  rememberDirectory(path);
  return path;
}

bool IdeCommands::open(const QString& path, bool replace) {
  auto& vbe = *m_window.vbe();
  if (replace) {
    if (!confirmClose(vbe.projects())) return false;
    for (const auto& project : std::vector(vbe.projects()))
      vbe.removeProject(project);
  }
  try {
    const auto projects = vbe.open(path);
    m_window.showStatus(QStringLiteral("Opened %1").arg(QFileInfo(path).fileName()), 5000);
    // The projects are open without the files they list that are missing: one message names them all.
    QStringList missing;
    const QString opened = QFileInfo(path).absoluteFilePath();
    for (const host::MissingFile& file : vbe.missingFiles()) {
      const bool listedHere =
          file.listedIn == opened || std::any_of(projects.begin(), projects.end(),
                                                 [&](auto& p) { return p->FileName() == file.listedIn; });
      if (listedHere)
        missing << QStringLiteral("%1    (%2, line %3)")
                       .arg(file.entry, QFileInfo(file.listedIn).fileName())
                       .arg(file.line);
    }
    if (!missing.isEmpty())
      m_window.ui().MsgBox(QStringLiteral("These files were not found and are not loaded; the project "
                                          "files keep their lines for them:\n\n") +
                               missing.join(u'\n'),
                           ide::mb::OKOnly | ide::mb::Exclamation, kTitle);
    rememberDirectory(QFileInfo(path).absoluteFilePath());
    // The start-up component (or the first one) is selected, as the IDE does after opening.
    if (!projects.empty() && !projects.front()->components().empty())
      m_window.explorer().selectComponent(projects.front()->components().front());
    return true;
  } catch (const ide::Error& error) {
    m_window.reportError(
        QStringLiteral("Cannot open %1.\n\n%2").arg(QDir::toNativeSeparators(path), error.description()));
    return false;
  }
}

bool IdeCommands::saveProjectAs(const std::shared_ptr<host::ProjectImpl>& project, QString path) {
  if (path.isEmpty()) {
    const QString suggestion = project->FileName().isEmpty()
                                   ? QDir(lastDirectory()).filePath(project->Name() + QStringLiteral(".vbp"))
                                   : project->FileName();
    path = askFileName(QStringLiteral("Save Project As"), QStringLiteral("Project Files (*.vbp)"), suggestion,
                       true);
    if (path.isEmpty()) return false;
    if (QFileInfo(path).suffix().isEmpty()) path += QStringLiteral(".vbp");
  }
  QDir().mkpath(QFileInfo(path).absolutePath());
  if (!runSave([&] { project->SaveAs(path); },
               QStringLiteral("Cannot save project %1.").arg(project->Name())))
    return false;
  m_window.showStatus(QStringLiteral("Saved %1").arg(QFileInfo(path).fileName()), 5000);
  return true;
}

bool IdeCommands::saveAll() {
  auto& vbe = *m_window.vbe();
  for (const auto& project : std::vector(vbe.projects()))
    if (project->FileName().isEmpty() && !saveProjectAs(project)) return false;
  // Flush what the editors still hold back, so that the files get the text the user sees.
  for (CodeWindow* window : m_window.windows().codeWindows())
    window->binding()->flush();
  if (!runSave([&] { vbe.saveAll(); }, QStringLiteral("Cannot save."),
               QStringLiteral("The files already on disk are unchanged.")))
    return false;
  m_window.showStatus(QStringLiteral("Saved"), 3000);
  return true;
}

bool IdeCommands::runSave(const std::function<void()>& save, const QString& failure,
                          const QString& nothingChanged) {
  for (;;) {
    try {
      save();
      return true;
    } catch (const fileio::FilesChangedOnDisk& error) {
      QStringList files;
      for (const QString& path : error.changed)
        files << QDir::toNativeSeparators(path);
      for (const QString& path : error.deleted)
        files << QDir::toNativeSeparators(path) + QStringLiteral(" (deleted)");
      const int answer = m_window.ui().MsgBox(
          QStringLiteral("These files were changed by another program since they were opened:\n\n%1\n\n"
                         "Overwrite them with the text in the IDE?")
              .arg(files.join(u'\n')),
          ide::mb::YesNo | ide::mb::Exclamation, kTitle);
      if (answer != ide::mb::Yes) return false;
      m_window.vbe()->acceptFilesOnDisk(error.changed + error.deleted);
    } catch (const fileio::SaveHalfDone& error) {
      // Some files hold the new text: the description says which.
      m_window.reportError(failure + QStringLiteral("\n\n") + error.description());
      return false;
    } catch (const ide::Error& error) {
      QString text = failure + QStringLiteral("\n\n") + error.description();
      if (!nothingChanged.isEmpty()) text += QStringLiteral("\n\n") + nothingChanged;
      m_window.reportError(text);
      return false;
    }
  }
}

bool IdeCommands::saveComponent(const std::shared_ptr<host::ComponentImpl>& component, bool askName) {
  if (!component->hasCode()) return true;
  const QString failure = QStringLiteral("Cannot save %1.").arg(component->Name());
  if (askName || component->filePath().isEmpty()) {
    const QString suggestion = component->filePath().isEmpty()
                                   ? QDir(component->project() && !component->project()->directory().isEmpty()
                                              ? component->project()->directory()
                                              : lastDirectory())
                                         .filePath(component->Name())
                                   : component->filePath();
    const QString path =
        askFileName(QStringLiteral("Save File As"), componentFilter(component->Type()), suggestion, true);
    if (path.isEmpty()) return false;
    return runSave([&] { component->SaveAs(path); }, failure);
  }
  return runSave([&] { component->save(); }, failure);
}

bool IdeCommands::confirmClose(const std::vector<std::shared_ptr<host::ProjectImpl>>& projects) {
  QStringList changed;
  for (const auto& project : projects) {
    if (project->Saved()) continue;
    changed << (project->FileName().isEmpty() ? project->Name() : QFileInfo(project->FileName()).fileName());
    for (const auto& component : project->components())
      if (component->IsDirty())
        changed << QStringLiteral("    ") + (component->filePath().isEmpty()
                                                 ? component->Name()
                                                 : QFileInfo(component->filePath()).fileName());
  }
  if (changed.isEmpty()) return true;
  const int answer =
      m_window.ui().MsgBox(QStringLiteral("Save changes to the following files?\n\n") + changed.join(u'\n'),
                           ide::mb::YesNoCancel | ide::mb::Exclamation, kTitle);
  if (answer == ide::mb::Cancel) return false;
  if (answer == ide::mb::No) return true;
  for (const auto& project : projects)
    if (project->FileName().isEmpty() && !saveProjectAs(project)) return false;
  for (CodeWindow* window : m_window.windows().codeWindows())
    window->binding()->flush();
  return runSave(
      [&] {
        for (const auto& project : projects)
          project->save();
      },
      QStringLiteral("Cannot save."));
}

bool IdeCommands::closeProject(const std::shared_ptr<host::ProjectImpl>& project) {
  if (!confirmClose({project})) return false;
  m_window.vbe()->removeProject(project);
  return true;
}

std::shared_ptr<host::ComponentImpl> IdeCommands::addComponent(ide::ComponentType type) {
  auto project = currentProject();
  if (!project) project = m_window.vbe()->newProject();
  auto component = std::static_pointer_cast<host::ComponentImpl>(project->Add(type));
  m_window.explorer().selectComponent(component);
  return component;
}

bool IdeCommands::removeComponent(const std::shared_ptr<host::ComponentImpl>& component) {
  auto project = component->project();
  if (!project) return false;
  if (component->IsDirty() && component->hasCode()) {
    const int answer = m_window.ui().MsgBox(QStringLiteral("Save changes to %1?").arg(component->Name()),
                                            ide::mb::YesNoCancel | ide::mb::Exclamation, kTitle);
    if (answer == ide::mb::Cancel) return false;
    if (answer == ide::mb::Yes && !saveComponent(component, false)) return false;
  }
  project->Remove(component);
  return true;
}

void IdeCommands::show(const std::shared_ptr<host::ComponentImpl>& component, bool code) {
  try {
    if (!code && component->hasDesigner()) {
      m_window.vbe()->activateWindow(component->designerWindow());
    } else if (component->hasCode()) {
      component->codeModule()->pane()->Show();
    } else {
      m_window.vbe()->selectComponent(component);
    }
  } catch (const ide::Error& error) {
    m_window.reportError(error.description());
  }
}

std::shared_ptr<host::ComponentImpl> IdeCommands::currentComponent() const {
  auto& vbe = *m_window.vbe();
  if (auto selected = std::dynamic_pointer_cast<host::ComponentImpl>(vbe.SelectedVBComponent()))
    return selected;
  auto active = std::dynamic_pointer_cast<host::WindowImpl>(vbe.ActiveWindow());
  return active ? active->component() : nullptr;
}

std::shared_ptr<host::ProjectImpl> IdeCommands::currentProject() const {
  if (auto component = currentComponent())
    if (auto project = component->project()) return project;
  return std::dynamic_pointer_cast<host::ProjectImpl>(m_window.vbe()->ActiveVBProject());
}

// ---------------------------------------------------------------------------------------------------
// Edit, find, add-ins

void IdeCommands::editCommand(host::BuiltinCommand command) {
  using B = host::BuiltinCommand;
  QWidget* focus = QApplication::focusWidget();
  if (auto* code = qobject_cast<CodeEditor*>(focus)) {
    // The editor works on the module's latest text.
    if (CodeWindow* window = m_window.windows().activeCodeWindow(); window && window->editor() == code)
      window->binding()->flush();
  }
  if (auto* edit = qobject_cast<QPlainTextEdit*>(focus)) {
    switch (command) {
      case B::Undo:
        edit->undo();
        break;
      case B::Redo:
        edit->redo();
        break;
      case B::Cut:
        edit->cut();
        break;
      case B::Copy:
        edit->copy();
        break;
      case B::Paste:
        edit->paste();
        break;
      default:
        break;
    }
  } else if (auto* line = qobject_cast<QLineEdit*>(focus)) {
    switch (command) {
      case B::Undo:
        line->undo();
        break;
      case B::Redo:
        line->redo();
        break;
      case B::Cut:
        line->cut();
        break;
      case B::Copy:
        line->copy();
        break;
      case B::Paste:
        line->paste();
        break;
      default:
        break;
    }
  }
}

void IdeCommands::find() {
  CodeWindow* window = m_window.windows().activeCodeWindow();
  if (!window) return;
  auto pane = window->pane();
  int sl = 0, sc = 0, el = 0, ec = 0;
  pane->GetSelection(sl, sc, el, ec);
  QString suggestion = m_lastFind;
  if (sl == el && ec > sc) suggestion = window->binding()->module()->text().line(sl).mid(sc - 1, ec - sc);
  FindDialog dialog(suggestion, &m_window);
  if (dialog.exec() != QDialog::Accepted || dialog.what->text().isEmpty()) return;
  m_lastFind = dialog.what->text();
  auto module = window->binding()->module();
  // From the end of the selection to the end of the module, then from the top.
  int startLine = el, startColumn = ec, endLine = -1, endColumn = -1;
  bool found =
      module->Find(m_lastFind, startLine, startColumn, endLine, endColumn, dialog.wholeWord->isChecked(),
                   dialog.matchCase->isChecked(), dialog.pattern->isChecked());
  if (!found) {
    startLine = 1, startColumn = 1, endLine = -1, endColumn = -1;
    found =
        module->Find(m_lastFind, startLine, startColumn, endLine, endColumn, dialog.wholeWord->isChecked(),
                     dialog.matchCase->isChecked(), dialog.pattern->isChecked());
  }
  if (!found) {
    m_window.ui().MsgBox(QStringLiteral("Search text not found."), ide::mb::OKOnly | ide::mb::Information,
                         kTitle);
    return;
  }
  pane->SetSelection(startLine, startColumn, endLine, endColumn);
}

void IdeCommands::showAddInManager() {
  AddInManagerDialog dialog(m_window.vbe()->addIns(), &m_window);
  dialog.setStartupStore([this](const QString& progId, bool load) {
    if (QSettings* settings = m_window.settings())
      settings->setValue(QStringLiteral("AddIns/") + progId, load);
  });
  if (dialog.exec() != QDialog::Accepted) return;
  dialog.apply([this](const QString& message) { m_window.reportError(message); });
}

}  // namespace desktop
