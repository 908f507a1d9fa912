// SPDX-License-Identifier: MIT
#include "icons.h"

#include <QBuffer>
#include <QHash>
#include <QPixmap>

// The pictures live in a static library: its resources are registered by name before the first use.
static void registerIconResources() {
  Q_INIT_RESOURCE(icons);
}

namespace desktop {
namespace {

struct GlyphFile {
  Glyph glyph;
  const char* name;  // icons/NAME.png and icons/NAME@2x.png
};

const GlyphFile kGlyphFiles[] = {
    {Glyph::NewProject, "new-project"},
    {Glyph::AddProject, "add-project"},
    {Glyph::AddForm, "add-form"},
    {Glyph::AddModule, "add-module"},
    {Glyph::AddClass, "add-class"},
    {Glyph::Open, "open"},
    {Glyph::Save, "save"},
    {Glyph::Cut, "cut"},
    {Glyph::Copy, "copy"},
    {Glyph::Paste, "paste"},
    {Glyph::Find, "find"},
    {Glyph::Undo, "undo"},
    {Glyph::Redo, "redo"},
    {Glyph::Start, "start"},
    {Glyph::Break, "break"},
    {Glyph::End, "end"},
    {Glyph::ProjectExplorer, "project-explorer"},
    {Glyph::Properties, "properties"},
    {Glyph::Toolbox, "toolbox"},
    {Glyph::Remove, "remove"},
    {Glyph::AddIns, "add-ins"},
    {Glyph::Exit, "exit"},
    {Glyph::ViewCode, "view-code"},
    {Glyph::ViewObject, "view-object"},
    {Glyph::About, "about"},
    {Glyph::ProcedureView, "procedure-view"},
    {Glyph::FullModuleView, "full-module-view"},
    {Glyph::Project, "project"},
    {Glyph::Folder, "folder"},
    {Glyph::Form, "form"},
    {Glyph::Module, "module"},
    {Glyph::ClassModule, "class-module"},
    {Glyph::Document, "document"},
    {Glyph::Pointer, "pointer"},
    {Glyph::PictureBox, "picture-box"},
    {Glyph::Label, "label"},
    {Glyph::TextBox, "text-box"},
    {Glyph::Frame, "frame"},
    {Glyph::CommandButton, "command-button"},
    {Glyph::CheckBox, "check-box"},
    {Glyph::OptionButton, "option-button"},
    {Glyph::ComboBox, "combo-box"},
    {Glyph::ListBox, "list-box"},
    {Glyph::HScrollBar, "h-scroll-bar"},
    {Glyph::VScrollBar, "v-scroll-bar"},
    {Glyph::Timer, "timer"},
    {Glyph::DriveListBox, "drive-list-box"},
    {Glyph::DirListBox, "dir-list-box"},
    {Glyph::FileListBox, "file-list-box"},
    {Glyph::Shape, "shape"},
    {Glyph::Line, "line"},
    {Glyph::Image, "image"},
};

const char* fileOf(Glyph glyph) {
  for (const GlyphFile& file : kGlyphFiles)
    if (file.glyph == glyph) return file.name;
  return nullptr;
}

}  // namespace

QIcon icon(Glyph glyph) {
  static QHash<int, QIcon> cache;
  static const bool registered = (registerIconResources(), true);
  Q_UNUSED(registered);
  if (const auto it = cache.constFind(static_cast<int>(glyph)); it != cache.constEnd()) return *it;
  QIcon result;
  if (const char* name = fileOf(glyph)) {
    const QString base = QStringLiteral(":/icons/") + QLatin1StringView(name);
    result.addFile(base + QStringLiteral(".png"), QSize(16, 16));
    result.addFile(base + QStringLiteral("@2x.png"), QSize(32, 32));
  }
  cache.insert(static_cast<int>(glyph), result);
  return result;
}

QByteArray glyphPng(Glyph glyph, int size) {
  QByteArray bytes;
  QBuffer buffer(&bytes);
  buffer.open(QIODevice::WriteOnly);
  icon(glyph).pixmap(QSize(size, size)).save(&buffer, "PNG");
  return bytes;
}

QIcon commandIcon(host::BuiltinCommand command) {
  using B = host::BuiltinCommand;
  switch (command) {
    case B::NewProject:
      return icon(Glyph::NewProject);
    case B::OpenProject:
      return icon(Glyph::Open);
    case B::AddProject:
      return icon(Glyph::AddProject);
    case B::RemoveProject:
    case B::RemoveComponent:
      return icon(Glyph::Remove);
    case B::SaveProject:
    case B::SaveFile:
      return icon(Glyph::Save);
    case B::Exit:
      return icon(Glyph::Exit);
    case B::Undo:
      return icon(Glyph::Undo);
    case B::Redo:
      return icon(Glyph::Redo);
    case B::Cut:
      return icon(Glyph::Cut);
    case B::Copy:
      return icon(Glyph::Copy);
    case B::Paste:
      return icon(Glyph::Paste);
    case B::Find:
      return icon(Glyph::Find);
    case B::AddForm:
      return icon(Glyph::AddForm);
    case B::AddModule:
      return icon(Glyph::AddModule);
    case B::AddClass:
      return icon(Glyph::AddClass);
    case B::ViewCode:
      return icon(Glyph::ViewCode);
    case B::ViewObject:
      return icon(Glyph::ViewObject);
    case B::ViewProjectExplorer:
      return icon(Glyph::ProjectExplorer);
    case B::ViewProperties:
      return icon(Glyph::Properties);
    case B::ViewToolbox:
      return icon(Glyph::Toolbox);
    case B::Start:
    case B::Continue:
      return icon(Glyph::Start);
    case B::Break:
      return icon(Glyph::Break);
    case B::End:
      return icon(Glyph::End);
    case B::AddInManager:
      return icon(Glyph::AddIns);
    case B::About:
      return icon(Glyph::About);
    default:
      return {};
  }
}

QIcon componentIcon(ide::ComponentType type) {
  switch (type) {
    case ide::ComponentType::StdModule:
      return icon(Glyph::Module);
    case ide::ComponentType::ClassModule:
      return icon(Glyph::ClassModule);
    case ide::ComponentType::VBForm:
    case ide::ComponentType::VBMDIForm:
    case ide::ComponentType::UserControl:
    case ide::ComponentType::PropPage:
    case ide::ComponentType::DocObject:
      return icon(Glyph::Form);
    default:
      return icon(Glyph::Document);
  }
}

QIcon controlIcon(const QString& className) {
  static const QHash<QString, Glyph> glyphs = {
      {QStringLiteral("PictureBox"), Glyph::PictureBox},
      {QStringLiteral("Label"), Glyph::Label},
      {QStringLiteral("TextBox"), Glyph::TextBox},
      {QStringLiteral("Frame"), Glyph::Frame},
      {QStringLiteral("CommandButton"), Glyph::CommandButton},
      {QStringLiteral("CheckBox"), Glyph::CheckBox},
      {QStringLiteral("OptionButton"), Glyph::OptionButton},
      {QStringLiteral("ComboBox"), Glyph::ComboBox},
      {QStringLiteral("ListBox"), Glyph::ListBox},
      {QStringLiteral("HScrollBar"), Glyph::HScrollBar},
      {QStringLiteral("VScrollBar"), Glyph::VScrollBar},
      {QStringLiteral("Timer"), Glyph::Timer},
      {QStringLiteral("DriveListBox"), Glyph::DriveListBox},
      {QStringLiteral("DirListBox"), Glyph::DirListBox},
      {QStringLiteral("FileListBox"), Glyph::FileListBox},
      {QStringLiteral("Shape"), Glyph::Shape},
      {QStringLiteral("Line"), Glyph::Line},
      {QStringLiteral("Image"), Glyph::Image},
      {QStringLiteral("Pointer"), Glyph::Pointer},
  };
  QString bare = className;
  if (bare.startsWith(QLatin1StringView("VB."), Qt::CaseInsensitive)) bare = bare.sliced(3);
  return icon(glyphs.value(bare, Glyph::Document));
}

}  // namespace desktop
