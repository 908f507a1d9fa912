// SPDX-License-Identifier: MIT
#include "codewindow.h"

#include "codebinding.h"
#include "codeeditor.h"
#include "host/files/controlevents.h"
#include "host/model/designer.h"
#include "host/model/objects.h"
#include "icons.h"
#include "qtplatform.h"

#include <QButtonGroup>
#include <QComboBox>
#include <QHBoxLayout>
#include <QScrollBar>
#include <QSet>
#include <QToolButton>
#include <QVBoxLayout>

#include <algorithm>
#include <map>

namespace desktop {
namespace {

const QString kGeneral = QStringLiteral("(General)");
const QString kDeclarations = QStringLiteral("(Declarations)");
const char* const kKindSuffix[] = {"", " [PropertyLet]", " [PropertySet]", " [PropertyGet]"};

/// A box that is filled when it opens, so that typing stays cheap.
class ListBox final : public QComboBox {
 public:
  using QComboBox::QComboBox;
  std::function<void()> beforePopup;

 protected:
  void showPopup() override {
    if (beforePopup) beforePopup();
    QComboBox::showPopup();
  }
};

bool lessCaseInsensitive(const QString& a, const QString& b) {
  return a.compare(b, Qt::CaseInsensitive) < 0;
}

/// Sets the box's current item to `text`, adding it when the box was not filled yet.
void showItem(QComboBox* box, const QString& text, const QVariant& data = {}) {
  int index = box->findText(text, Qt::MatchFixedString | Qt::MatchCaseSensitive);
  if (index < 0) {
    box->addItem(text, data);
    index = box->count() - 1;
  }
  box->setCurrentIndex(index);
}

}  // namespace

CodeWindow::CodeWindow(const std::shared_ptr<host::WindowImpl>& window, QWidget* parent)
    : QWidget(parent), m_window(window) {
  auto* objects = new ListBox(this);
  objects->beforePopup = [this] { fillObjects(); };
  objects->setObjectName(QStringLiteral("objectList"));
  objects->setSizeAdjustPolicy(QComboBox::AdjustToContents);
  objects->setMinimumContentsLength(24);
  m_objects = objects;
  auto* procedures = new ListBox(this);
  procedures->beforePopup = [this] { fillProcedures(m_objects->currentText()); };
  procedures->setObjectName(QStringLiteral("procedureList"));
  procedures->setSizeAdjustPolicy(QComboBox::AdjustToContents);
  procedures->setMinimumContentsLength(28);
  m_procedures = procedures;
  m_editor = new CodeEditor(this);
  m_editor->setObjectName(QStringLiteral("codeEditor"));

  auto* top = new QHBoxLayout;
  top->setContentsMargins(2, 2, 2, 2);
  top->addWidget(m_objects);
  top->addWidget(m_procedures);
  top->addStretch();
  auto* layout = new QVBoxLayout(this);
  layout->setContentsMargins(0, 0, 0, 0);
  layout->setSpacing(0);
  layout->addLayout(top);
  layout->addWidget(m_editor);

  // The two view buttons stand left of the horizontal scroll bar, which is always there for them.
  auto* views = new QWidget(this);
  views->setObjectName(QStringLiteral("codeViewButtons"));
  auto* viewsLayout = new QHBoxLayout(views);
  viewsLayout->setContentsMargins(0, 0, 0, 0);
  viewsLayout->setSpacing(0);
  auto* group = new QButtonGroup(views);
  const auto viewButton = [&](const char* name, Glyph glyph, const QString& tip) {
    auto* button = new QToolButton(views);
    button->setObjectName(QLatin1StringView(name));
    button->setIcon(icon(glyph));
    button->setToolTip(tip);
    button->setCheckable(true);
    button->setAutoRaise(true);
    button->setFocusPolicy(Qt::NoFocus);
    const int side = m_editor->horizontalScrollBar()->sizeHint().height();
    button->setFixedSize(side + 2, side);
    button->setIconSize(QSize(side - 4, side - 4));
    group->addButton(button);
    viewsLayout->addWidget(button);
    return button;
  };
  m_procedureViewButton = viewButton("procedureView", Glyph::ProcedureView, QStringLiteral("Procedure View"));
  m_fullModuleViewButton =
      viewButton("fullModuleView", Glyph::FullModuleView, QStringLiteral("Full Module View"));
  m_fullModuleViewButton->setChecked(true);
  views->setFixedSize(views->sizeHint());
  m_editor->setHorizontalScrollBarPolicy(Qt::ScrollBarAlwaysOn);
  m_editor->addScrollBarWidget(views, Qt::AlignLeft);
  connect(m_procedureViewButton, &QToolButton::clicked, this, [this] { setProcedureView(true); });
  connect(m_fullModuleViewButton, &QToolButton::clicked, this, [this] { setProcedureView(false); });

  auto paneOf = window->pane();
  auto module = std::static_pointer_cast<host::CodeModuleImpl>(paneOf->CodeModule());
  m_binding = new CodeBinding(module, m_editor);
  m_editor->setBeforeInput([binding = m_binding] { binding->flush(); });
  connect(m_editor, &CodeEditor::contextMenuWanted, this, &CodeWindow::contextMenuWanted);
  connect(m_binding, &CodeBinding::editRejected, this, &CodeWindow::editRejected);
  connect(m_binding, &CodeBinding::caretMoved, this, &CodeWindow::caretMoved);
  // Moving the caret shows its procedure at once; while the text changes, the module's structure is
  // only looked up when the typing pauses.
  connect(m_binding, &CodeBinding::caretMoved, this, [this] {
    if (m_editor->document()->revision() == m_shownRevision)
      showProcedureOfCaret();
    else
      m_caretTimer.start();
  });
  connect(m_objects, &QComboBox::activated, this,
          [this](int index) { chooseObject(m_objects->itemText(index)); });
  connect(m_procedures, &QComboBox::activated, this,
          [this](int index) { chooseProcedure(m_procedures->itemText(index), index); });
  m_caretTimer.setSingleShot(true);
  m_caretTimer.setInterval(150);
  connect(&m_caretTimer, &QTimer::timeout, this, &CodeWindow::showProcedureOfCaret);
  setFocusProxy(m_editor);
  showProcedureOfCaret();
}

CodeWindow::~CodeWindow() = default;

std::shared_ptr<host::CodePaneImpl> CodeWindow::pane() const {
  return m_binding->pane();
}

std::vector<CodeObject> CodeWindow::objects() const {
  std::vector<CodeObject> result;
  auto component = m_binding->module()->component();
  if (!component) return result;
  if (auto form = component->form()) {
    // The module's own object is named by its kind: Form, MDIForm, UserControl ...
    result.push_back(
        {host::componentTypeName(component->Type()), form->description().root().className(), false});
    std::map<QString, CodeObject> controls;  // by lower-case name: an array once
    for (const auto& control : form->controls()) {
      const host::FormNode* node = control->node();
      auto& entry = controls[node->name().toLower()];
      entry.name = node->name();
      entry.className = node->className();
      entry.controlArray = entry.controlArray || node->index() >= 0;
    }
    for (auto& [key, object] : controls)
      result.push_back(std::move(object));
  } else if (component->Type() == ide::ComponentType::ClassModule) {
    result.push_back({QStringLiteral("Class"), QStringLiteral("Class"), false});
  }
  return result;
}

std::pair<QString, QString> CodeWindow::ownerOf(const QString& procedure,
                                                const std::vector<CodeObject>& objects) const {
  // The longest object name that starts the procedure's name and is followed by one of its events: names
  // may hold underscores themselves.
  std::pair<QString, QString> owner;
  for (const CodeObject& object : objects) {
    if (object.name.size() <= owner.first.size() || procedure.size() <= object.name.size() + 1 ||
        !procedure.startsWith(object.name, Qt::CaseInsensitive) || procedure[object.name.size()] != u'_')
      continue;
    const QStringView event = QStringView(procedure).mid(object.name.size() + 1);
    for (const host::EventInfo& info : host::controlEvents(object.className))
      if (event.compare(QLatin1StringView(info.name), Qt::CaseInsensitive) == 0)
        owner = {object.name, QString::fromLatin1(info.name)};
  }
  return owner;
}

void CodeWindow::fillLists() {
  fillObjects();
  showProcedureOfCaret();
  fillProcedures(m_objects->currentText());
  showProcedureOfCaret();
}

void CodeWindow::fillObjects() {
  m_filling = true;
  const QString current = m_objects->currentText();
  m_objects->clear();
  m_objects->addItem(kGeneral);
  for (const CodeObject& object : objects())
    m_objects->addItem(object.name);
  showItem(m_objects, current.isEmpty() ? kGeneral : current);
  m_filling = false;
}

void CodeWindow::fillProcedures(const QString& object) {
  m_filling = true;
  const QString current = m_procedures->currentText();
  m_procedures->clear();
  m_proceduresOf = object;
  auto& text = m_binding->module()->text();
  const std::vector<CodeObject> all = objects();
  if (object.isEmpty() || object == kGeneral) {
    m_procedures->addItem(kDeclarations, QVariantList{QString(), 0});
    // Each declaration at its own place: two of one name in #If ... #Else branches are two entries.
    const std::vector<ide::ProcExtent> extents = text.procedureExtents();
    std::vector<const ide::ProcExtent*> general;
    for (const ide::ProcExtent& extent : extents)
      if (ownerOf(extent.name, all).first.isEmpty()) general.push_back(&extent);
    std::stable_sort(general.begin(), general.end(), [](const ide::ProcExtent* a, const ide::ProcExtent* b) {
      return lessCaseInsensitive(a->name, b->name);
    });
    for (const ide::ProcExtent* extent : general) {
      const int kind = static_cast<int>(extent->kind);
      m_procedures->addItem(extent->name + QLatin1StringView(kKindSuffix[kind]),
                            QVariantList{extent->name, kind, extent->bodyLine});
    }
  } else if (const auto found =
                 std::find_if(all.begin(), all.end(), [&](const CodeObject& o) { return o.name == object; });
             found != all.end()) {
    QSet<QString> existing;
    for (const host::ProcInfo& proc : text.procedures())
      existing.insert(proc.name.toLower());
    QFont bold = m_procedures->font();
    bold.setBold(true);
    for (const host::EventInfo& event : host::controlEvents(found->className)) {
      const QString name = found->name + u'_' + QLatin1StringView(event.name);
      m_procedures->addItem(QString::fromLatin1(event.name), QVariantList{name, 0});
      if (existing.contains(name.toLower()))
        m_procedures->setItemData(m_procedures->count() - 1, bold, Qt::FontRole);
    }
  }
  const int index = m_procedures->findText(current, Qt::MatchFixedString | Qt::MatchCaseSensitive);
  if (index >= 0) m_procedures->setCurrentIndex(index);
  m_filling = false;
}

void CodeWindow::showProcedureOfCaret() {
  m_shownRevision = m_editor->document()->revision();
  auto pane = m_binding->pane();
  auto& text = m_binding->module()->text();
  const int line = pane->selection().startLine;
  ide::ProcKind kind = ide::ProcKind::Proc;
  const QString name = line <= text.countOfLines() ? text.procOfLine(line, kind) : QString();
  QString object = kGeneral;
  QString item = kDeclarations;
  if (!name.isEmpty()) {
    const auto [owner, event] = ownerOf(name, objects());
    if (owner.isEmpty()) {
      item = name + QLatin1StringView(kKindSuffix[static_cast<int>(kind)]);
    } else {
      object = owner;
      item = event;
    }
  }
  m_filling = true;
  showItem(m_objects, object);
  if (m_proceduresOf != object) {
    // The box held another object's procedures: it is filled again when it opens.
    m_procedures->clear();
    m_proceduresOf.clear();
  }
  showItem(m_procedures, item, QVariantList{name, static_cast<int>(kind)});
  m_filling = false;
  updateView();
}

void CodeWindow::setProcedureView(bool procedureView) {
  m_procedureView = procedureView;
  (procedureView ? m_procedureViewButton : m_fullModuleViewButton)->setChecked(true);
  m_binding->flush();
  showProcedureOfCaret();
}

void CodeWindow::updateView() {
  auto& text = m_binding->module()->text();
  try {
    if (m_separatorsRevision != m_shownRevision) {
      m_separatorsRevision = m_shownRevision;
      std::vector<int> lines;
      for (const ide::ProcExtent& extent : text.procedureExtents())
        if (extent.startLine > 1) lines.push_back(extent.startLine);
      m_editor->setSeparators(std::move(lines));
    }
    if (!m_procedureView) {
      m_editor->showLines(0, 0);
      return;
    }
    const int line = std::min(m_binding->pane()->selection().startLine, std::max(1, text.countOfLines()));
    if (const auto around = text.extentOfLine(line))
      m_editor->showLines(around->startLine, around->startLine + around->countLines - 1);
    else
      m_editor->showLines(1, std::max(1, text.countOfDeclarationLines()));
  } catch (const ide::Error& error) {
    // A module the index cannot answer for is shown whole.
    qCDebug(lcIde) << "the code window shows its whole module:" << error.description();
    m_editor->showLines(0, 0);
  }
}

void CodeWindow::chooseObject(const QString& object) {
  if (m_filling) return;
  const std::vector<CodeObject> all = objects();
  const auto found =
      std::find_if(all.begin(), all.end(), [&](const CodeObject& o) { return o.name == object; });
  if (object == kGeneral || found == all.end()) {
    pane()->SetSelection(1, 1, 1, 1);
    m_editor->setFocus();
    fillProcedures(kGeneral);
    showProcedureOfCaret();
    return;
  }
  // The object's first event procedure, else the procedure of its default event.
  auto& text = m_binding->module()->text();
  QString first;
  for (const host::ProcInfo& proc : text.procedures()) {
    const auto [owner, event] = ownerOf(proc.name, all);
    if (owner == object && (first.isEmpty() || lessCaseInsensitive(proc.name, first))) first = proc.name;
  }
  if (!first.isEmpty()) {
    goToProcedure(first, ide::ProcKind::Proc);
  } else if (const QString event = host::defaultEvent(found->className); !event.isEmpty()) {
    writeEventProcedure(*found, event);
  }
  fillProcedures(object);
  showProcedureOfCaret();
}

void CodeWindow::chooseProcedure(const QString& item, int index) {
  if (m_filling) return;
  const QString object = m_objects->currentText();
  if (m_proceduresOf != object) fillProcedures(object);
  if (index < 0 || index >= m_procedures->count() || m_procedures->itemText(index) != item)
    index = m_procedures->findText(item, Qt::MatchFixedString | Qt::MatchCaseSensitive);
  const QVariantList data = index >= 0 ? m_procedures->itemData(index).toList() : QVariantList();
  if (data.size() < 2) return;
  const QString name = data.at(0).toString();
  if (name.isEmpty()) {
    pane()->SetSelection(1, 1, 1, 1);
    m_editor->setFocus();
    return;
  }
  const std::vector<CodeObject> all = objects();
  const auto found =
      std::find_if(all.begin(), all.end(), [&](const CodeObject& o) { return o.name == object; });
  bool exists = false;
  for (const host::ProcInfo& proc : m_binding->module()->text().procedures())
    exists = exists || proc.name.compare(name, Qt::CaseInsensitive) == 0;
  if (!exists && found != all.end()) {
    writeEventProcedure(*found, item);
    fillProcedures(object);
  } else if (data.size() > 2 && data.at(2).toInt() <= m_binding->module()->CountOfLines()) {
    const int line = data.at(2).toInt();  // that declaration, not the first of its name
    pane()->SetSelection(line, 1, line, 1);
    m_editor->setFocus();
  } else {
    goToProcedure(name, static_cast<ide::ProcKind>(data.at(1).toInt()));
  }
  showProcedureOfCaret();
}

void CodeWindow::goToProcedure(const QString& name, ide::ProcKind kind) {
  int line = 1;
  try {
    line = m_binding->module()->ProcBodyLine(name, kind);
  } catch (const ide::Error&) {
    return;  // edited away meanwhile
  }
  pane()->SetSelection(line, 1, line, 1);
  m_editor->setFocus();
}

void CodeWindow::writeEventProcedure(const CodeObject& object, const QString& event) {
  if (m_editor->isReadOnly()) return;  // the program runs
  const auto events = host::controlEvents(object.className);
  const auto info = std::find_if(events.begin(), events.end(), [&](const host::EventInfo& e) {
    return event.compare(QLatin1StringView(e.name), Qt::CaseInsensitive) == 0;
  });
  if (info == events.end()) return;
  auto module = m_binding->module();
  const int count = module->CountOfLines();
  // At the end of the module, a blank line apart from what is above it.
  QStringList lines;
  if (count > 0 && !module->Lines(count, 1).trimmed().isEmpty()) lines << QString();
  lines << host::eventProcedureHeader(object.name, *info, object.controlArray) << QString()
        << QStringLiteral("End Sub");
  try {
    module->InsertLines(count + 1, lines.join(QStringLiteral("\r\n")));
  } catch (const ide::Error& error) {
    Q_EMIT editRejected(error.description());
    return;
  }
  m_binding->flush();
  const int body = count + static_cast<int>(lines.size()) - 1;
  pane()->SetSelection(body, 1, body, 1);
  m_editor->setFocus();
}

}  // namespace desktop
