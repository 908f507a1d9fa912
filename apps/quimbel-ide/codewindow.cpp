// SPDX-License-Identifier: MIT
#include "codewindow.h"

#include "codebinding.h"
#include "codeeditor.h"

#include <QComboBox>
#include <QHBoxLayout>
#include <QVBoxLayout>

namespace desktop {
namespace {

const char* const kKindSuffix[] = {"", " [Let]", " [Set]", " [Get]"};

/// The procedure list shows what the module holds, refilled when it opens so that typing stays cheap.
class ProcedureBox final : public QComboBox {
 public:
  using QComboBox::QComboBox;
  std::function<void()> beforePopup;

 protected:
  void showPopup() override {
    if (beforePopup) beforePopup();
    QComboBox::showPopup();
  }
};

}  // namespace

CodeWindow::CodeWindow(const std::shared_ptr<host::WindowImpl>& window, QWidget* parent)
    : QWidget(parent), m_window(window) {
  auto* procedures = new ProcedureBox(this);
  procedures->beforePopup = [this] { fillProcedures(); };
  procedures->setObjectName(QStringLiteral("procedureList"));
  procedures->setSizeAdjustPolicy(QComboBox::AdjustToContents);
  procedures->setMinimumContentsLength(28);
  m_procedures = procedures;
  m_editor = new CodeEditor(this);
  m_editor->setObjectName(QStringLiteral("codeEditor"));

  auto* top = new QHBoxLayout;
  top->setContentsMargins(2, 2, 2, 2);
  top->addWidget(m_procedures);
  top->addStretch();
  auto* layout = new QVBoxLayout(this);
  layout->setContentsMargins(0, 0, 0, 0);
  layout->setSpacing(0);
  layout->addLayout(top);
  layout->addWidget(m_editor);

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
  connect(m_procedures, &QComboBox::activated, this, &CodeWindow::jumpToProcedure);
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

void CodeWindow::fillProcedures() {
  m_filling = true;
  m_procedures->clear();
  m_procedures->addItem(QStringLiteral("(Declarations)"), QVariantList{QString(), 0});
  auto& text = m_binding->module()->text();
  for (const host::ProcInfo& proc : text.procedures()) {
    const int kind = static_cast<int>(proc.kind);
    m_procedures->addItem(proc.name + QLatin1StringView(kKindSuffix[kind]), QVariantList{proc.name, kind});
  }
  m_filling = false;
  showProcedureOfCaret();
}

void CodeWindow::showProcedureOfCaret() {
  m_shownRevision = m_editor->document()->revision();
  auto pane = m_binding->pane();
  auto& text = m_binding->module()->text();
  const int line = pane->selection().startLine;
  ide::ProcKind kind = ide::ProcKind::Proc;
  const QString name = line <= text.countOfLines() ? text.procOfLine(line, kind) : QString();
  const QString label = name.isEmpty() ? QStringLiteral("(Declarations)")
                                       : name + QLatin1StringView(kKindSuffix[static_cast<int>(kind)]);
  int index = m_procedures->findText(label);
  if (index < 0) {
    m_procedures->addItem(label, QVariantList{name, static_cast<int>(kind)});
    index = m_procedures->count() - 1;
  }
  m_procedures->setCurrentIndex(index);
}

void CodeWindow::jumpToProcedure(int index) {
  if (m_filling) return;
  const QVariantList data = m_procedures->itemData(index).toList();
  if (data.size() != 2) return;
  auto module = m_binding->module();
  int line = 1;
  const QString name = data.at(0).toString();
  if (!name.isEmpty()) {
    try {
      line = module->ProcBodyLine(name, static_cast<ide::ProcKind>(data.at(1).toInt()));
    } catch (const ide::Error&) {
      return;  // edited away meanwhile
    }
  }
  pane()->SetSelection(line, 1, line, 1);
  m_editor->setFocus();
}

}  // namespace desktop
