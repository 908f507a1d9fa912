// SPDX-License-Identifier: MIT
#include "textins/textswindow.h"

#include "common/errors.h"
#include "common/strings.h"
#include "textins/hotkey.h"
#include "textins/textinsertion.h"
#include "textins/texts.h"

#include <QAction>
#include <QClipboard>
#include <QFocusEvent>
#include <QFontDatabase>
#include <QGuiApplication>
#include <QHBoxLayout>
#include <QKeyEvent>
#include <QLabel>
#include <QListWidget>
#include <QPlainTextEdit>
#include <QSignalBlocker>
#include <QToolBar>
#include <QVBoxLayout>

#include <algorithm>

namespace textins {
namespace {

struct ButtonSpec {
  const char* key;
  const char16_t* tip;
};

constexpr ButtonSpec kButtons[] = {
    {"Save", u"Salvar"}, {"Undo", u"Desfazer"},  {"Cut", u"Recortar"}, {"Copy", u"Copiar"},
    {"Paste", u"Colar"}, {"Delete", u"Excluir"}, {"Help", u"Ajuda"},
};

bool clipboardHasText() {
  const QClipboard* clipboard = QGuiApplication::clipboard();
  return clipboard && !clipboard->text().isEmpty();
}

}  // namespace

TextsWindow::TextsWindow(ide::UserInterface& ui, HelpOpener help, const Layout& layout, QWidget* parent)
    : QDialog(parent),
      m_ui(ui),
      m_help(std::move(help)),
      m_layout(layout),
      m_list(new QListWidget(this)),
      m_text(new QPlainTextEdit(this)),
      m_toolBar(new QToolBar(this)),
      m_toolBars(new QHBoxLayout) {
  setWindowTitle(common::title() + QStringLiteral(" - ") + common::LoadResString(layout.caption));
  m_list->setObjectName(QLatin1StringView(layout.listName));
  m_text->setObjectName(QLatin1StringView(layout.textName));
  m_toolBar->setObjectName(QLatin1StringView(layout.toolBarName));

  for (const ButtonSpec& item : kButtons) {
    const QString key = QLatin1StringView(item.key);
    QAction* action = m_toolBar->addAction(
        QIcon(QStringLiteral(":/quimbel/textins/%1.xpm").arg(key.toLower())), QString::fromUtf16(item.tip));
    action->setObjectName(key);
    m_toolBar->widgetForAction(action)->setObjectName(key);
    if (key == QLatin1StringView("Delete") || key == QLatin1StringView("Help")) {
      m_toolBar->insertSeparator(action);
    }
  }
  connect(button(QStringLiteral("Save")), &QAction::triggered, this, &TextsWindow::Save_Click);
  connect(button(QStringLiteral("Undo")), &QAction::triggered, this, &TextsWindow::Undo_Click);
  connect(button(QStringLiteral("Cut")), &QAction::triggered, this, &TextsWindow::Cut_Click);
  connect(button(QStringLiteral("Copy")), &QAction::triggered, this, &TextsWindow::Copy_Click);
  connect(button(QStringLiteral("Paste")), &QAction::triggered, this, &TextsWindow::Paste_Click);
  connect(button(QStringLiteral("Delete")), &QAction::triggered, this, &TextsWindow::Delete_Click);
  connect(button(QStringLiteral("Help")), &QAction::triggered, this,
          [this] { openHelp(m_layout.helpContext); });

  auto* listLabel = new QLabel(common::LoadResString(layout.listLabel), this);
  auto* textLabel = new QLabel(common::LoadResString(layout.textLabel), this);
  listLabel->setBuddy(m_list);
  textLabel->setBuddy(m_text);
  QFont code = QFontDatabase::systemFont(QFontDatabase::FixedFont);
  code.setFamily(QStringLiteral("DejaVu Sans Mono"));
  code.setStyleHint(QFont::Monospace);
  m_text->setFont(code);
  m_text->setLineWrapMode(QPlainTextEdit::NoWrap);
  // Undo is the window's own (a swap with the text before the last edit), not the box's history.
  m_text->setUndoRedoEnabled(false);
  m_text->installEventFilter(this);
  m_list->setFixedWidth(m_list->fontMetrics().horizontalAdvance(QStringLiteral("Ctrl+Shift+W")) * 3 / 2 + 32);

  m_toolBars->addWidget(m_toolBar);
  m_toolBars->addStretch();
  auto* left = new QVBoxLayout;
  left->addWidget(listLabel);
  left->addWidget(m_list, 1);
  auto* right = new QVBoxLayout;
  right->addWidget(textLabel);
  right->addWidget(m_text, 1);
  auto* body = new QHBoxLayout;
  body->addLayout(left);
  body->addLayout(right, 1);
  auto* main = new QVBoxLayout(this);
  main->addLayout(m_toolBars);
  main->addLayout(body, 1);
  resize(640, 400);

  connect(m_list, &QListWidget::currentRowChanged, this, &TextsWindow::showEntry);
  connect(m_list, &QListWidget::itemChanged, this, &TextsWindow::itemChanged);
  connect(m_text, &QPlainTextEdit::textChanged, this, &TextsWindow::textChanged);
  connect(m_text, &QPlainTextEdit::selectionChanged, this, &TextsWindow::followSelection);
  if (QClipboard* clipboard = QGuiApplication::clipboard()) {
    connect(clipboard, &QClipboard::dataChanged, this, [this] {
      if (m_text->hasFocus()) button(QStringLiteral("Paste"))->setEnabled(clipboardHasText());
    });
  }
  followFocus(false);
}

QAction* TextsWindow::button(const QString& key) const {
  for (QAction* action : m_toolBar->actions())
    if (action->objectName() == key) return action;
  return nullptr;
}

QToolBar* TextsWindow::addToolBarBeside(const char* name) {
  auto* bar = new QToolBar(this);
  bar->setObjectName(QLatin1StringView(name));
  m_toolBars->insertWidget(m_toolBars->count() - 1, bar);
  return bar;
}

void TextsWindow::fill(std::vector<TextEntry> entries) {
  m_loading = true;
  m_text->clear();
  m_entries = std::move(entries);
  {
    const QSignalBlocker blocker(m_list);
    m_list->clear();
    for (const TextEntry& entry : m_entries) {
      auto* item = new QListWidgetItem(entry.name, m_list);
      item->setData(Qt::UserRole, entry.id);
      item->setFlags(item->flags() | Qt::ItemIsUserCheckable);
      item->setCheckState(*entry.enabled ? Qt::Checked : Qt::Unchecked);
    }
    m_list->setCurrentRow(0);
  }
  m_loading = false;
  showEntry(m_list->currentRow());
  m_changed = false;
  button(QStringLiteral("Save"))->setEnabled(false);
  button(QStringLiteral("Undo"))->setEnabled(false);
}

void TextsWindow::showEntry(int row) {
  if (m_loading) return;
  m_current = row >= 0 && row < static_cast<int>(m_entries.size()) ? row : -1;
  m_loading = true;
  m_text->setUpdatesEnabled(false);
  m_text->setPlainText(m_current >= 0 ? *m_entries[size_t(m_current)].text : QString());
  m_text->setUpdatesEnabled(true);
  m_loading = false;
  m_shown = m_text->toPlainText();
  m_undo.reset();
  m_typedTo = -1;
  button(QStringLiteral("Undo"))->setEnabled(false);
}

void TextsWindow::itemChanged(QListWidgetItem* item) {
  const int row = m_list->row(item);
  if (m_loading || row < 0 || row >= static_cast<int>(m_entries.size())) return;
  const TextEntry& entry = m_entries[size_t(row)];
  const bool checked = item->checkState() == Qt::Checked;
  if (*entry.enabled == checked) return;
  *entry.enabled = checked;
  // Toggled twice is unchanged again: nothing is written for it.
  *entry.changed ^= HK_CHANGE_STATE;
  setChanged();
}

void TextsWindow::textChanged() {
  if (m_loading || m_current < 0) return;
  const QString text = m_text->toPlainText();
  if (text == m_shown) return;
  if (const std::optional<char32_t> character = firstNonAnsi(text)) {
    // Typed or pasted, it would go into code that cannot be saved: the text stays as it was.
    const int caret = std::clamp(m_text->textCursor().position() - int(text.size() - m_shown.size()), 0,
                                 int(m_shown.size()));
    m_loading = true;
    m_text->setPlainText(m_shown);
    QTextCursor cursor = m_text->textCursor();
    cursor.setPosition(caret);
    m_text->setTextCursor(cursor);
    m_loading = false;
    m_typedTo = -1;
    m_ui.MsgBox(nonAnsiMessage(*character), ide::mb::Exclamation, common::title());
    return;
  }
  // One character typed next to the previous one continues the same edit.
  const int caret = m_text->textCursor().position();
  const bool typedOne = text.size() == m_shown.size() + 1 && caret > 0 &&
                        QStringView(text).left(caret - 1) == QStringView(m_shown).left(caret - 1) &&
                        QStringView(text).mid(caret) == QStringView(m_shown).mid(caret - 1);
  if (!typedOne || caret - 1 != m_typedTo || !m_undo) m_undo = m_shown;
  m_typedTo = typedOne ? caret : -1;
  m_shown = text;
  const TextEntry& entry = m_entries[size_t(m_current)];
  // The box breaks lines with LF; code and copied text have the IDE's CRLF.
  *entry.text = QString(text).replace(u'\n', QStringLiteral("\r\n"));
  *entry.changed |= HK_CHANGE_TEXT;
  setChanged();
  button(QStringLiteral("Undo"))->setEnabled(true);
}

void TextsWindow::setChanged() {
  m_changed = true;
  button(QStringLiteral("Save"))->setEnabled(true);
}

void TextsWindow::followFocus(bool focused) {
  const bool selected = focused && m_text->textCursor().hasSelection();
  button(QStringLiteral("Undo"))->setEnabled(focused && m_undo.has_value());
  button(QStringLiteral("Cut"))->setEnabled(selected);
  button(QStringLiteral("Copy"))->setEnabled(selected);
  button(QStringLiteral("Delete"))->setEnabled(selected);
  button(QStringLiteral("Paste"))->setEnabled(focused && clipboardHasText());
  textBoxFocusChanged(focused);
}

void TextsWindow::followSelection() {
  if (!m_text->hasFocus()) return;
  const bool selected = m_text->textCursor().hasSelection();
  for (const char* key : {"Cut", "Copy", "Delete"})
    button(QLatin1StringView(key))->setEnabled(selected);
}

bool TextsWindow::eventFilter(QObject* watched, QEvent* event) {
  if (watched != m_text) return QDialog::eventFilter(watched, event);
  switch (event->type()) {
    case QEvent::FocusIn:
      followFocus(true);
      break;
    case QEvent::FocusOut:
      // A menu opening over the box (the reserved words) leaves the buttons as they are.
      if (static_cast<QFocusEvent*>(event)->reason() != Qt::PopupFocusReason) followFocus(false);
      break;
    case QEvent::KeyPress: {
      const auto* key = static_cast<QKeyEvent*>(event);
      const auto modifiers =
          key->modifiers() & (Qt::ControlModifier | Qt::ShiftModifier | Qt::AltModifier | Qt::MetaModifier);
      if (modifiers == Qt::ControlModifier) {
        switch (key->key()) {
          case Qt::Key_C:
            Copy_Click();
            return true;
          case Qt::Key_X:
            Cut_Click();
            return true;
          case Qt::Key_Z:
            Undo_Click();
            return true;
          default:
            break;
        }
      }
      if ((key->key() == Qt::Key_Delete || key->key() == Qt::Key_Backspace) &&
          m_text->textCursor().hasSelection()) {
        if (modifiers & Qt::ShiftModifier)
          Cut_Click();
        else
          Delete_Click();
        return true;
      }
      break;
    }
    default:
      break;
  }
  return QDialog::eventFilter(watched, event);
}

void TextsWindow::insertAtCaret(const QString& text) {
  m_text->insertPlainText(text);
  m_text->setFocus(Qt::OtherFocusReason);
}

void TextsWindow::openHelp(int context) {
  if (!m_help || !m_help(context))
    m_ui.MsgBox(common::LoadResString(kHelpNotFound), ide::mb::Exclamation, common::title());
}

bool TextsWindow::save() {
  try {
    saveWorkingSet();
  } catch (const std::exception& failure) {
    common::recordError(failure, objectName(), QStringLiteral("Save"), __LINE__);
    reportFailure();
    return false;
  }
  // The copy is in step with the owner now: a later toggle is measured from what was saved.
  for (const TextEntry& entry : m_entries)
    *entry.changed = 0;
  m_changed = false;
  button(QStringLiteral("Save"))->setEnabled(false);
  button(QStringLiteral("Undo"))->setEnabled(false);
  return true;
}

void TextsWindow::Save_Click() {
  save();
}

void TextsWindow::Undo_Click() {
  if (!m_undo) return;
  const QString previous = *m_undo;
  m_typedTo = -1;
  m_text->setPlainText(previous);
  m_text->moveCursor(QTextCursor::End);
}

void TextsWindow::Cut_Click() {
  if (m_text->textCursor().hasSelection()) m_text->cut();
}

void TextsWindow::Copy_Click() {
  if (m_text->textCursor().hasSelection()) m_text->copy();
}

void TextsWindow::Paste_Click() {
  m_text->paste();
}

void TextsWindow::Delete_Click() {
  QTextCursor cursor = m_text->textCursor();
  if (!cursor.hasSelection()) return;
  cursor.removeSelectedText();
  m_text->setTextCursor(cursor);
}

void TextsWindow::done(int result) {
  if (m_changed) {
    const int answer = m_ui.MsgBox(common::LoadResString(m_layout.saveQuestion),
                                   ide::mb::YesNo | ide::mb::Question, m_layout.questionCaption);
    // A save that fails keeps the window open, so that nothing typed is lost.
    if (answer == ide::mb::Yes && !save()) return;
  }
  QDialog::done(result);
}

void execTextsWindow(ide::UserInterface& ui, int loadFailed,
                     const std::function<std::unique_ptr<TextsWindow>(QWidget* parent)>& make) {
  std::unique_ptr<TextsWindow> window;
  try {
    window = make(qobject_cast<QWidget*>(ui.dialogParent()));
  } catch (const std::exception& failure) {
    common::recordError(failure, QStringLiteral("TextsWindow"), QStringLiteral("Form_Load"), __LINE__);
    common::logLastError();
    ui.MsgBox(common::LoadResString(loadFailed), ide::mb::Exclamation, common::title());
    return;
  }
  window->exec();
}

}  // namespace textins
