// SPDX-License-Identifier: MIT
// What the macro editor and the copy-buffer window share: a checkable list of hotkeys beside the text of
// the selected one, a toolbar (Save, Undo, Cut, Copy, Paste, Delete, Help), and the rules of a working
// copy that reaches its owner only on Save or on Yes when the window closes.
//
// Undo swaps the text with the one it had before the last edit (so a second Undo redoes); characters
// typed one after another count as one edit. Ctrl+C, Ctrl+X and Ctrl+Z act as Copy, Cut and Undo;
// Delete and Backspace over a selection as Delete, or as Cut with Shift. The editing buttons follow the
// text box: enabled while it has the focus and there is something for them to do. Lines of an edited text
// are stored with the IDE's CRLF.
#pragma once

#include "ide/platform.h"

#include <QDialog>
#include <QString>

#include <functional>
#include <memory>
#include <optional>
#include <vector>

class QHBoxLayout;
class QListWidget;
class QListWidgetItem;
class QPlainTextEdit;
class QToolBar;
class QAction;

namespace textins {

/// One line of the list: its caption and the working copy's fields it edits.
struct TextEntry {
  QString name;
  int id = 0;
  QString* text = nullptr;
  bool* enabled = nullptr;
  qint32* changed = nullptr;
};

/// Opens a help page by its context number; false when it cannot.
using HelpOpener = std::function<bool(int context)>;

class TextsWindow : public QDialog {
  Q_OBJECT

 public:
  QListWidget* list() const { return m_list; }
  QPlainTextEdit* textBox() const { return m_text; }
  QToolBar* toolBar() const { return m_toolBar; }
  /// A toolbar button by its key: "Save", "Undo", "Cut", "Copy", "Paste", "Delete", "Help".
  QAction* button(const QString& key) const;
  /// Something was changed since the window was filled or last saved.
  bool isChanged() const { return m_changed; }

 protected:
  struct Layout {
    int caption;  // string-table numbers
    int listLabel;
    int textLabel;
    int saveQuestion;
    QString questionCaption;
    int helpContext;
    const char* listName;  // object names
    const char* textName;
    const char* toolBarName;
  };
  TextsWindow(ide::UserInterface& ui, HelpOpener help, const Layout& layout, QWidget* parent);

  /// Shows `entries` (InitWindow): the first line selected, Save and Undo disabled.
  void fill(std::vector<TextEntry> entries);
  /// Hands the working copy to the owner and saves it; raises what saving raised.
  virtual void saveWorkingSet() = 0;
  /// Tells the user that a toolbar action or the save on closing failed (the last-error record holds it).
  virtual void reportFailure() = 0;
  /// The text box got (true) or lost the focus; the editing buttons have followed already.
  virtual void textBoxFocusChanged(bool) {}
  /// Puts `text` at the caret, over the selection, keeping the focus in the text box.
  void insertAtCaret(const QString& text);
  /// Opens the help page of `context`, or says that it cannot.
  void openHelp(int context);
  /// Where a subclass puts a second toolbar, beside the first.
  QToolBar* addToolBarBeside(const char* name);
  ide::UserInterface& ui() const { return m_ui; }

  void done(int result) override;
  bool eventFilter(QObject* watched, QEvent* event) override;

 private:
  void showEntry(int row);
  void itemChanged(QListWidgetItem* item);
  void textChanged();
  void setChanged();
  void followFocus(bool focused);
  void followSelection();
  bool save();

  void Save_Click();
  void Undo_Click();
  void Cut_Click();
  void Copy_Click();
  void Paste_Click();
  void Delete_Click();

  ide::UserInterface& m_ui;
  HelpOpener m_help;
  Layout m_layout;
  QListWidget* m_list;
  QPlainTextEdit* m_text;
  QToolBar* m_toolBar;
  QHBoxLayout* m_toolBars;
  std::vector<TextEntry> m_entries;
  int m_current = -1;
  bool m_loading = false;
  bool m_changed = false;
  /// The text as last shown or edited, and the one before the last edit.
  QString m_shown;
  std::optional<QString> m_undo;
  /// Where the caret stood after the last character typed (-1: the next edit starts a new one).
  int m_typedTo = -1;
};

/// Builds a window with `make` over the IDE's window and shows it modally until it closes. A failure while
/// it is built or filled is logged and shows the string-table message `loadFailed`.
void execTextsWindow(ide::UserInterface& ui, int loadFailed,
                     const std::function<std::unique_ptr<TextsWindow>(QWidget* parent)>& make);

}  // namespace textins
