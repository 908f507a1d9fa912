// SPDX-License-Identifier: MIT
#include "scriptrunner.h"

#include "codebinding.h"
#include "codeeditor.h"
#include "codewindow.h"
#include "commandbarview.h"
#include "designerview.h"
#include "idecommands.h"
#include "mainwindow.h"
#include "projectexplorer.h"
#include "propertiesview.h"
#include "qtplatform.h"
#include "toolbox.h"
#include "windowmanager.h"

#include <QAbstractButton>
#include <QAbstractItemView>
#include <QAbstractSpinBox>
#include <QApplication>
#include <QCheckBox>
#include <QComboBox>
#include <QDateTime>
#include <QDialog>
#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QKeySequence>
#include <QLineEdit>
#include <QListWidget>
#include <QMessageBox>
#include <QPlainTextEdit>
#include <QProcessEnvironment>
#include <QRadioButton>
#include <QSlider>
#include <QSpinBox>
#include <QStatusBar>
#include <QTabWidget>
#include <QTest>
#include <QTextEdit>
#include <QTreeWidget>

#include <cstdio>
#include <span>
#include <utility>

namespace desktop {
namespace {

struct StepError {
  QString message;
};

[[noreturn]] void fail(const QString& message) {
  throw StepError{message};
}

int answerCode(const QString& text) {
  static const std::pair<const char*, int> kAnswers[] = {
      {"ok", ide::mb::OK},       {"cancel", ide::mb::Cancel}, {"abort", ide::mb::Abort},
      {"retry", ide::mb::Retry}, {"ignore", ide::mb::Ignore}, {"yes", ide::mb::Yes},
      {"no", ide::mb::No}};
  for (const auto& [name, code] : kAnswers)
    if (text.compare(QLatin1StringView(name), Qt::CaseInsensitive) == 0) return code;
  return 0;
}

QMessageBox::StandardButton buttonOfAnswer(int answer) {
  switch (answer) {
    case ide::mb::OK:
      return QMessageBox::Ok;
    case ide::mb::Cancel:
      return QMessageBox::Cancel;
    case ide::mb::Abort:
      return QMessageBox::Abort;
    case ide::mb::Retry:
      return QMessageBox::Retry;
    case ide::mb::Ignore:
      return QMessageBox::Ignore;
    case ide::mb::Yes:
      return QMessageBox::Yes;
    case ide::mb::No:
      return QMessageBox::No;
    default:
      return QMessageBox::NoButton;
  }
}

QString plain(QString text) {
  text.remove(u'&');
  return text.trimmed();
}

int toNumber(const QString& text, const char* what) {
  bool ok = false;
  const int value = text.toInt(&ok);
  if (!ok) fail(QStringLiteral("%1 must be a number, not \"%2\"").arg(QLatin1StringView(what), text));
  return value;
}

bool toBool(const QString& text) {
  const QString t = text.trimmed().toLower();
  if (t == QLatin1StringView("true") || t == QLatin1StringView("1") || t == QLatin1StringView("yes") ||
      t == QLatin1StringView("on") || t == QLatin1StringView("checked"))
    return true;
  if (t == QLatin1StringView("false") || t == QLatin1StringView("0") || t == QLatin1StringView("no") ||
      t == QLatin1StringView("off") || t == QLatin1StringView("unchecked"))
    return false;
  fail(QStringLiteral("\"%1\" is not true or false").arg(text));
}

/// Splits a line into words: blanks separate, double quotes group (with \" \\ \n \t inside), # outside
/// quotes starts a comment. ${NAME} is replaced from the environment (SCRIPT_DIR is the script's folder).
bool splitWords(const QString& line, const QProcessEnvironment& environment, QStringList* words,
                QString* error) {
  QString word;
  bool inWord = false;
  bool quoted = false;
  auto expand = [&](qsizetype& i) {
    const qsizetype close = line.indexOf(u'}', i + 2);
    if (close < 0) {
      *error = QStringLiteral("unclosed ${ in \"%1\"").arg(line.mid(i));
      return false;
    }
    const QString name = line.mid(i + 2, close - i - 2);
    if (!environment.contains(name)) {
      *error = QStringLiteral("unknown variable ${%1}").arg(name);
      return false;
    }
    word += environment.value(name);
    i = close;
    return true;
  };
  for (qsizetype i = 0; i < line.size(); ++i) {
    const QChar c = line.at(i);
    if (quoted) {
      if (c == u'"') {
        quoted = false;
      } else if (c == u'\\' && i + 1 < line.size()) {
        const QChar next = line.at(++i);
        word += next == u'n' ? QChar(u'\n') : next == u't' ? QChar(u'\t') : next;
      } else if (c == u'$' && i + 1 < line.size() && line.at(i + 1) == u'{') {
        if (!expand(i)) return false;
      } else {
        word += c;
      }
      continue;
    }
    if (c.isSpace()) {
      if (inWord) *words << word;
      word.clear();
      inWord = false;
      continue;
    }
    if (c == u'#' && !inWord) break;
    inWord = true;
    if (c == u'"') {
      quoted = true;
    } else if (c == u'$' && i + 1 < line.size() && line.at(i + 1) == u'{') {
      if (!expand(i)) return false;
    } else {
      word += c;
    }
  }
  if (quoted) {
    *error = QStringLiteral("unclosed quote");
    return false;
  }
  if (inWord) *words << word;
  return true;
}

/// Types a text as key presses, so that it goes the way the user's typing goes.
void typeText(QWidget* target, const QString& text) {
  for (const QChar c : text) {
    if (c == u'\n') {
      QTest::keyClick(target, Qt::Key_Return);
    } else if (c == u'\t') {
      QTest::keyClick(target, Qt::Key_Tab);
    } else {
      const Qt::Key key = c.unicode() < 0x7F ? static_cast<Qt::Key>(c.toUpper().unicode()) : Qt::Key_unknown;
      QTest::sendKeyEvent(QTest::Click, target, key, QString(c), Qt::NoModifier);
    }
  }
}

/// Whether a command-bar control answers to a name: its caption, tooltip or tag.
bool controlMatches(host::CommandBarControlImpl& control, const QString& name) {
  return host::sameCaption(control.Caption(), name) || host::sameCaption(control.TooltipText(), name) ||
         (!control.Tag().isEmpty() && control.Tag().compare(name, Qt::CaseInsensitive) == 0);
}

}  // namespace

// ---------------------------------------------------------------------------------------------------
// The commands

/// Every command of the language in one table: its name, how many arguments it takes, whether it runs
/// while a message box waits for its answer, what parse() checks of its arguments and what it does.
struct ScriptRunner::Commands {
  struct Entry {
    const char* name;
    int minimum;
    int maximum;  // -1: any number
    /// A message box stops the IDE until it is answered: only the steps that deal with it go on meanwhile.
    bool whileABoxIsOpen;
    /// Checked when the script is read: an empty text or the mistake.
    QString (*check)(const QStringList& args);
    void (*run)(ScriptRunner& runner, const QStringList& args);
  };
  /// The kinds of "expect": the word after it, how many arguments that takes in all and what they are.
  struct Expectation {
    const char* what;
    int minimum;
    int maximum;  // -1: any number
    const char* takes;
    void (*check)(ScriptRunner& runner, const QStringList& args);
  };

  static std::span<const Entry> table();
  static const Entry* find(const QString& name) {
    for (const Entry& entry : table())
      if (name == QLatin1StringView(entry.name)) return &entry;
    return nullptr;
  }

  static host::VbeImpl& vbe(ScriptRunner& runner) { return *runner.m_window.vbe(); }
  static QString absolute(const QString& path) {
    return QFileInfo(path).isAbsolute() ? path : QDir::current().absoluteFilePath(path);
  }
  static std::shared_ptr<host::ComponentImpl> component(ScriptRunner& runner, const QString& name) {
    const qsizetype dot = name.indexOf(u'.');
    for (const auto& project : vbe(runner).projects()) {
      if (dot >= 0 && project->Name().compare(name.left(dot), Qt::CaseInsensitive) != 0) continue;
      if (auto found = project->component(dot >= 0 ? name.mid(dot + 1) : name)) return found;
    }
    fail(QStringLiteral("no component \"%1\" is open").arg(name));
  }
  static CodeWindow* activeCode(ScriptRunner& runner) {
    WindowManager& windows = runner.m_window.windows();
    CodeWindow* window = windows.activeCodeWindow();
    if (!window) {
      if (auto pane = std::dynamic_pointer_cast<host::CodePaneImpl>(vbe(runner).ActiveCodePane()))
        window = windows.codeWindowOf(pane->window().get());
    }
    if (!window) fail(QStringLiteral("no code window is active"));
    return window;
  }

  static void open(ScriptRunner& runner, const QStringList& args) {
    runner.m_window.commands().open(absolute(args[0]), false);
  }

  static void select(ScriptRunner& runner, const QStringList& args) {
    runner.m_window.explorer().selectComponent(component(runner, args[0]));
  }

  static void code(ScriptRunner& runner, const QStringList& args) {
    runner.m_window.commands().show(component(runner, args[0]), true);
  }

  static void designer(ScriptRunner& runner, const QStringList& args) {
    auto found = component(runner, args[0]);
    if (!found->hasDesigner()) fail(QStringLiteral("%1 has no designer").arg(args[0]));
    runner.m_window.commands().show(found, false);
  }

  /// caret LINE COLUMN, selection LINE COLUMN END-LINE END-COLUMN.
  static void selection(ScriptRunner& runner, const QStringList& args) {
    CodeWindow* window = activeCode(runner);
    const int l1 = toNumber(args[0], "the line"), c1 = toNumber(args[1], "the column");
    const int l2 = args.size() > 2 ? toNumber(args[2], "the end line") : l1;
    const int c2 = args.size() > 2 ? toNumber(args[3], "the end column") : c1;
    window->pane()->SetSelection(l1, c1, l2, c2);
    window->editor()->setFocus();
  }

  static void type(ScriptRunner&, const QStringList& args) {
    QWidget* target = QApplication::focusWidget();
    if (!target) fail(QStringLiteral("nothing has the keyboard focus"));
    typeText(target, args[0]);
  }

  static void key(ScriptRunner& runner, const QStringList& args) {
    for (const QString& combination : args) {
      const QKeySequence sequence = QKeySequence::fromString(combination, QKeySequence::PortableText);
      if (sequence.isEmpty() || sequence[0].key() == Qt::Key_unknown)
        fail(QStringLiteral("\"%1\" is not a key combination").arg(combination));
      for (int i = 0; i < sequence.count(); ++i) {
        QWidget* target = QApplication::focusWidget();
        if (!target)
          target = QApplication::activeModalWidget() ? QApplication::activeModalWidget() : &runner.m_window;
        QTest::keyClick(target, sequence[i].key(), sequence[i].keyboardModifiers());
      }
    }
  }

  static void click(ScriptRunner& runner, const QStringList& args) {
    runner.m_window.commandBars().syncNow();
    auto bar = vbe(runner).commandBars()->bar(args[0]);
    if (!bar) fail(QStringLiteral("no command bar \"%1\"").arg(args[0]));
    std::shared_ptr<host::CommandBarControlImpl> control;
    for (int i = 1; i < args.size(); ++i) {
      control.reset();
      QStringList known;
      for (const auto& candidate : bar->controls()) {
        known << plain(candidate->Caption().isEmpty() ? candidate->TooltipText() : candidate->Caption());
        if (controlMatches(*candidate, args[i])) {
          control = candidate;
          break;
        }
      }
      if (!control)
        fail(QStringLiteral("no control \"%1\" on \"%2\" (it has: %3)")
                 .arg(args[i], bar->Name().isEmpty() ? args[i - 1] : bar->Name(),
                      known.join(QStringLiteral(", "))));
      if (i + 1 < args.size()) {
        bar = control->popupBar();
        if (!bar) fail(QStringLiteral("\"%1\" is not a menu").arg(args[i]));
      }
    }
    if (!control->Visible()) fail(QStringLiteral("\"%1\" is not visible").arg(args.last()));
    if (!control->Enabled()) fail(QStringLiteral("\"%1\" is disabled").arg(args.last()));
    runner.m_window.commandBars().click(control);
  }

  static void tool(ScriptRunner& runner, const QStringList& args) {
    if (!runner.m_window.toolbox().click(args[0]))
      fail(QStringLiteral("the toolbox has no \"%1\"").arg(args[0]));
  }

  static void control(ScriptRunner& runner, const QStringList& args) {
    DesignerWindow* designer = runner.m_window.windows().activeDesigner();
    if (!designer) fail(QStringLiteral("no form designer is active"));
    auto control = designer->form()->findControl(args[0]);
    if (!control) fail(QStringLiteral("the form has no control \"%1\"").arg(args[0]));
    designer->selectControl(control);
  }

  static void property(ScriptRunner& runner, const QStringList& args) {
    if (!runner.m_window.properties().applyEdit(args[0], args[1]))
      fail(QStringLiteral("the property %1 did not take \"%2\"").arg(args[0], args[1]));
  }

  static void set(ScriptRunner& runner, const QStringList& args) {
    QWidget* widget = runner.findWidget(args[0]);
    if (!widget) return runner.notYet(QStringLiteral("no widget named \"%1\" is open").arg(args[0]));
    const QString& value = args[1];
    if (auto* line = qobject_cast<QLineEdit*>(widget)) {
      line->selectAll();
      line->insert(value);
    } else if (auto* plainEdit = qobject_cast<QPlainTextEdit*>(widget)) {
      plainEdit->setPlainText(value);
    } else if (auto* textEdit = qobject_cast<QTextEdit*>(widget)) {
      textEdit->setPlainText(value);
    } else if (auto* spin = qobject_cast<QSpinBox*>(widget)) {
      spin->setValue(toNumber(value, "the value"));
    } else if (auto* check = qobject_cast<QCheckBox*>(widget)) {
      if (check->isChecked() != toBool(value)) check->click();
    } else if (auto* radio = qobject_cast<QRadioButton*>(widget)) {
      if (toBool(value) && !radio->isChecked()) radio->click();
    } else if (auto* combo = qobject_cast<QComboBox*>(widget)) {
      int index = combo->findText(value);
      if (index < 0) index = combo->findText(value, Qt::MatchFixedString);
      if (index >= 0) {
        combo->setCurrentIndex(index);
        Q_EMIT combo->activated(index);
      } else if (combo->isEditable()) {
        combo->setEditText(value);
      } else {
        fail(QStringLiteral("\"%1\" has no item \"%2\"").arg(args[0], value));
      }
    } else if (auto* slider = qobject_cast<QAbstractSlider*>(widget)) {
      slider->setValue(toNumber(value, "the value"));
    } else if (auto* tabs = qobject_cast<QTabWidget*>(widget)) {
      int index = -1;
      for (int i = 0; i < tabs->count(); ++i)
        if (plain(tabs->tabText(i)).compare(value, Qt::CaseInsensitive) == 0) index = i;
      if (index < 0) fail(QStringLiteral("\"%1\" has no tab \"%2\"").arg(args[0], value));
      tabs->setCurrentIndex(index);
    } else if (auto* view = qobject_cast<QAbstractItemView*>(widget)) {
      const QModelIndexList found = view->model()->match(view->model()->index(0, 0), Qt::DisplayRole, value,
                                                         1, Qt::MatchFixedString | Qt::MatchRecursive);
      if (found.isEmpty()) fail(QStringLiteral("\"%1\" has no item \"%2\"").arg(args[0], value));
      view->setCurrentIndex(found.front());
      view->scrollTo(found.front());
      // As a click on the item: its window active and the list focused, so that keys go to the list.
      view->activateWindow();
      view->setFocus();
    } else {
      fail(QStringLiteral("cannot set a value on \"%1\" (%2)")
               .arg(args[0], QLatin1StringView(widget->metaObject()->className())));
    }
  }

  static void doubleClick(ScriptRunner& runner, const QStringList& args) {
    QWidget* widget = runner.findWidget(args[0]);
    if (!widget) return runner.notYet(QStringLiteral("no widget named \"%1\" is open").arg(args[0]));
    auto* view = qobject_cast<QAbstractItemView*>(widget);
    if (!view) fail(QStringLiteral("\"%1\" is not a list").arg(args[0]));
    QAbstractItemModel* model = view->model();
    QModelIndex found;
    for (int column = 0; model && column < model->columnCount() && !found.isValid(); ++column) {
      const QModelIndexList matches = model->match(model->index(0, column), Qt::DisplayRole, args[1], 1,
                                                   Qt::MatchFixedString | Qt::MatchRecursive);
      if (!matches.isEmpty()) found = matches.front();
    }
    if (!found.isValid()) fail(QStringLiteral("\"%1\" has no item \"%2\"").arg(args[0], args[1]));
    view->scrollTo(found);
    const QPoint at = view->visualRect(found).center();
    // As a mouse does it: a click, then the press that makes it a double-click.
    QTest::mouseClick(view->viewport(), Qt::LeftButton, {}, at);
    QTest::mouseDClick(view->viewport(), Qt::LeftButton, {}, at);
  }

  static void press(ScriptRunner& runner, const QStringList& args) {
    QAbstractButton* found = nullptr;
    std::vector<QWidget*> tops = runner.dialogs();
    tops.push_back(&runner.m_window);
    for (QWidget* top : tops) {
      for (QAbstractButton* button : top->findChildren<QAbstractButton*>()) {
        if (!button->isVisible()) continue;
        if (button->objectName() == args[0] ||
            plain(button->text()).compare(plain(args[0]), Qt::CaseInsensitive) == 0) {
          found = button;
          break;
        }
      }
      if (found) break;
    }
    if (!found) return runner.notYet(QStringLiteral("no button \"%1\" is open").arg(args[0]));
    if (!found->isEnabled()) fail(QStringLiteral("the button \"%1\" is disabled").arg(args[0]));
    found->click();
  }

  static QString checkAnswer(const QStringList& args) {
    if (answerCode(args[0])) return {};
    return QStringLiteral("\"%1\" is not an answer (OK, Cancel, Yes, No, Abort, Retry, Ignore)").arg(args[0]);
  }

  static void answer(ScriptRunner& runner, const QStringList& args) {
    runner.m_ui.queueAnswer(answerCode(args[0]));
  }

  static void save(ScriptRunner& runner, const QStringList&) {
    if (!runner.m_window.commands().saveAll()) fail(QStringLiteral("saving failed"));
  }

  static void saveAs(ScriptRunner& runner, const QStringList& args) {
    IdeCommands& commands = runner.m_window.commands();
    auto project = commands.currentProject();
    if (!project) fail(QStringLiteral("no project is open"));
    const QString path = absolute(args[0]);
    if (!commands.saveProjectAs(project, path)) fail(QStringLiteral("saving %1 failed").arg(path));
  }

  static void screenshot(ScriptRunner& runner, const QStringList& args) {
    const QString which = args.size() == 2 ? args[0].toLower() : QString();
    QWidget* target = nullptr;
    if (which == QLatin1StringView("main")) {
      target = &runner.m_window;
    } else if (which == QLatin1StringView("dialog")) {
      const auto open = runner.dialogs();
      if (open.empty()) return runner.notYet(QStringLiteral("no dialog is open"));
      target = open.front();
    } else if (!which.isEmpty()) {
      fail(QStringLiteral("screenshot takes main or dialog, not \"%1\"").arg(args[0]));
    } else {
      const auto open = runner.dialogs();
      target = open.empty() ? &runner.m_window : open.front();
    }
    runner.m_window.commandBars().syncNow();
    for (CodeWindow* window : runner.m_window.windows().codeWindows())
      window->binding()->flush();
    QCoreApplication::processEvents();
    const QString path = absolute(args.last());
    QDir().mkpath(QFileInfo(path).absolutePath());
    if (!target->grab().save(path)) fail(QStringLiteral("cannot write %1").arg(path));
  }

  static void wait(ScriptRunner& runner, const QStringList& args) {
    // A time has put the next step off already (tick()); a condition holds the script until it is met.
    const QString what = args[0].toLower();
    if (what == QLatin1StringView("dialog")) {
      if (runner.dialogs().empty()) return runner.notYet(QStringLiteral("no dialog opened"));
    } else if (what == QLatin1StringView("closed")) {
      if (QWidget* open = QApplication::activeModalWidget())
        return runner.notYet(QStringLiteral("the dialog \"%1\" stayed open").arg(open->windowTitle()));
    } else {
      toNumber(args[0], "the time");
    }
  }

  static std::span<const Expectation> expectations();

  static void expect(ScriptRunner& runner, const QStringList& args) {
    const QString what = args[0].toLower();
    QStringList known;
    for (const Expectation& expectation : expectations()) {
      known << QLatin1StringView(expectation.what);
      if (what != QLatin1StringView(expectation.what)) continue;
      if (args.size() < expectation.minimum ||
          (expectation.maximum >= 0 && args.size() > expectation.maximum))
        fail(QStringLiteral("expect %1 takes %2").arg(what, QLatin1StringView(expectation.takes)));
      return expectation.check(runner, args);
    }
    fail(QStringLiteral("cannot expect \"%1\" (%2)").arg(args[0], known.join(QStringLiteral(", "))));
  }

  static void expectLine(ScriptRunner& runner, const QStringList& args) {
    CodeWindow* window = activeCode(runner);
    window->binding()->flush();
    auto module = window->binding()->module();
    const int n = toNumber(args[1], "the line");
    if (n < 1 || n > module->CountOfLines())
      fail(QStringLiteral("line %1 is past the end of %2 (%3 lines)")
               .arg(n)
               .arg(module->Name())
               .arg(module->CountOfLines()));
    const QString actual = module->Lines(n, 1);
    if (actual != args[2]) fail(QStringLiteral("line %1 is \"%2\", not \"%3\"").arg(n).arg(actual, args[2]));
  }

  static void expectMessage(ScriptRunner& runner, const QStringList& args) {
    if (!runner.m_lastMessage.contains(args[1]))
      fail(QStringLiteral("the last message was \"%1\", which does not contain \"%2\"")
               .arg(runner.m_lastMessage, args[1]));
  }

  static void expectProjects(ScriptRunner& runner, const QStringList& args) {
    const int n = toNumber(args[1], "the count");
    const size_t open = vbe(runner).projects().size();
    if (static_cast<int>(open) != n) fail(QStringLiteral("%1 projects are open, not %2").arg(open).arg(n));
  }

  static void expectStatus(ScriptRunner& runner, const QStringList& args) {
    const QString shown = runner.m_window.statusBar()->currentMessage();
    if (!shown.contains(args[1])) fail(QStringLiteral("the status bar says \"%1\"").arg(shown));
  }

  static void expectTitle(ScriptRunner& runner, const QStringList& args) {
    if (!runner.m_window.windowTitle().contains(args[1]))
      fail(QStringLiteral("the title is \"%1\"").arg(runner.m_window.windowTitle()));
  }

  static bool controlPresent(ScriptRunner& runner, const QStringList& args) {
    runner.m_window.commandBars().syncNow();
    auto bar = vbe(runner).commandBars()->bar(args[1]);
    for (int i = 2; bar && i < args.size(); ++i) {
      std::shared_ptr<host::CommandBarControlImpl> control;
      for (const auto& candidate : bar->controls())
        if (controlMatches(*candidate, args[i])) control = candidate;
      if (!control || !control->Visible()) return false;
      if (i + 1 == args.size()) return true;
      bar = control->popupBar();
    }
    return false;
  }

  static void expectControl(ScriptRunner& runner, const QStringList& args) {
    if (!controlPresent(runner, args))
      fail(QStringLiteral("\"%1\" is not there on \"%2\"")
               .arg(args.mid(2).join(QStringLiteral(" > ")), args[1]));
  }

  static void expectNoControl(ScriptRunner& runner, const QStringList& args) {
    if (controlPresent(runner, args))
      fail(QStringLiteral("\"%1\" is there on \"%2\"").arg(args.mid(2).join(QStringLiteral(" > ")), args[1]));
  }

  static void expectValue(ScriptRunner& runner, const QStringList& args) {
    QWidget* widget = runner.findWidget(args[1]);
    if (!widget) return runner.notYet(QStringLiteral("no widget named \"%1\" is open").arg(args[1]));
    QString actual;
    if (auto* line = qobject_cast<QLineEdit*>(widget))
      actual = line->text();
    else if (auto* edit = qobject_cast<QPlainTextEdit*>(widget))
      actual = edit->toPlainText();
    else if (auto* check = qobject_cast<QAbstractButton*>(widget))
      actual = check->isChecked() ? QStringLiteral("true") : QStringLiteral("false");
    else if (auto* combo = qobject_cast<QComboBox*>(widget))
      actual = combo->currentText();
    else if (auto* spin = qobject_cast<QAbstractSpinBox*>(widget))
      actual = spin->text();
    else
      actual = widget->property("text").toString();
    if (actual != args[2])
      fail(QStringLiteral("\"%1\" holds \"%2\", not \"%3\"").arg(args[1], actual, args[2]));
  }

  static void expectProperty(ScriptRunner& runner, const QStringList& args) {
    const QString actual = runner.m_window.properties().shownValue(args[1]);
    if (actual != args[2]) fail(QStringLiteral("%1 shows \"%2\", not \"%3\"").arg(args[1], actual, args[2]));
  }

  static void echo(ScriptRunner&, const QStringList& args) {
    std::printf("%s\n", qPrintable(args.join(u' ')));
    std::fflush(stdout);
  }

  static void quit(ScriptRunner& runner, const QStringList&) { runner.m_next = runner.m_steps.size(); }
};

std::span<const ScriptRunner::Commands::Entry> ScriptRunner::Commands::table() {
  constexpr bool kBlocked = false;  // waits while a message box is open
  constexpr bool kAlways = true;
  static const Entry kTable[] = {
      {"open", 1, 1, kBlocked, nullptr, &open},
      {"select", 1, 1, kBlocked, nullptr, &select},
      {"code", 1, 1, kBlocked, nullptr, &code},
      {"designer", 1, 1, kBlocked, nullptr, &designer},
      {"caret", 2, 2, kBlocked, nullptr, &selection},
      {"selection", 4, 4, kBlocked, nullptr, &selection},
      {"type", 1, 1, kBlocked, nullptr, &type},
      {"key", 1, -1, kBlocked, nullptr, &key},
      {"click", 2, -1, kBlocked, nullptr, &click},
      {"tool", 1, 1, kBlocked, nullptr, &tool},
      {"control", 1, 1, kBlocked, nullptr, &control},
      {"property", 2, 2, kBlocked, nullptr, &property},
      {"set", 2, 2, kAlways, nullptr, &set},
      {"press", 1, 1, kAlways, nullptr, &press},
      {"doubleclick", 2, 2, kBlocked, nullptr, &doubleClick},
      {"answer", 1, 1, kAlways, &checkAnswer, &answer},
      {"save", 0, 0, kBlocked, nullptr, &save},
      {"saveas", 1, 1, kBlocked, nullptr, &saveAs},
      {"screenshot", 1, 2, kAlways, nullptr, &screenshot},
      {"wait", 1, 1, kAlways, nullptr, &wait},
      {"expect", 2, -1, kAlways, nullptr, &expect},
      {"echo", 1, -1, kAlways, nullptr, &echo},
      {"quit", 0, 0, kAlways, nullptr, &quit},
  };
  return kTable;
}

std::span<const ScriptRunner::Commands::Expectation> ScriptRunner::Commands::expectations() {
  static const Expectation kExpectations[] = {
      {"line", 3, 3, "a line number and a text", &expectLine},
      {"message", 2, -1, "a text", &expectMessage},
      {"projects", 2, -1, "a count", &expectProjects},
      {"title", 2, -1, "a text", &expectTitle},
      {"status", 2, -1, "a text", &expectStatus},
      {"control", 3, -1, "a bar and a caption", &expectControl},
      {"no-control", 3, -1, "a bar and a caption", &expectNoControl},
      {"value", 3, 3, "a widget name and a text", &expectValue},
      {"property", 3, 3, "a property name and a text", &expectProperty},
  };
  return kExpectations;
}

// ---------------------------------------------------------------------------------------------------
// Running

ScriptRunner::ScriptRunner(MainWindow& window, QtUserInterface& ui)
    : QObject(&window), m_window(window), m_ui(ui) {
  m_previousObserver = m_ui.messageObserver();
  m_ui.setMessageObserver([this](const QString& title, const QString& text) {
    noteMessage(title, text);
    if (m_previousObserver) m_previousObserver(title, text);
  });
  qApp->installEventFilter(this);
  m_closer.setInterval(100);
}

ScriptRunner::~ScriptRunner() {
  qApp->removeEventFilter(this);
  m_ui.setMessageObserver(m_previousObserver);
}

bool ScriptRunner::load(const QString& path, QString* error) {
  QFile file(path);
  if (!file.open(QIODevice::ReadOnly | QIODevice::Text)) {
    *error = QStringLiteral("%1: cannot read the script: %2").arg(path, file.errorString());
    return false;
  }
  m_directory = QFileInfo(path).absolutePath();
  return parse(QString::fromUtf8(file.readAll()), path, error);
}

bool ScriptRunner::parse(const QString& text, const QString& name, QString* error) {
  m_name = name;
  m_steps.clear();
  QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
  environment.insert(QStringLiteral("SCRIPT_DIR"), m_directory.isEmpty() ? QDir::currentPath() : m_directory);
  const QStringList lines = text.split(u'\n');
  for (int i = 0; i < lines.size(); ++i) {
    QStringList words;
    QString problem;
    const auto mistake = [&](const QString& what) {
      *error = QStringLiteral("%1:%2: %3").arg(name).arg(i + 1).arg(what);
      return false;
    };
    if (!splitWords(lines[i], environment, &words, &problem)) return mistake(problem);
    if (words.isEmpty()) continue;
    ScriptStep step{i + 1, words.takeFirst().toLower(), words};
    const Commands::Entry* entry = Commands::find(step.command);
    if (!entry) return mistake(QStringLiteral("unknown command \"%1\"").arg(step.command));
    const int count = static_cast<int>(step.arguments.size());
    if (count < entry->minimum || (entry->maximum >= 0 && count > entry->maximum))
      return mistake(QStringLiteral("\"%1\" takes %2 argument%3, not %4")
                         .arg(step.command)
                         .arg(entry->maximum == entry->minimum ? QString::number(entry->minimum)
                              : entry->maximum < 0
                                  ? QStringLiteral("%1 or more").arg(entry->minimum)
                                  : QStringLiteral("%1 to %2").arg(entry->minimum).arg(entry->maximum))
                         .arg(entry->maximum == 1 && entry->minimum == 1 ? QString() : QStringLiteral("s"))
                         .arg(count));
    if (entry->check)
      if (const QString invalid = entry->check(step.arguments); !invalid.isEmpty()) return mistake(invalid);
    m_steps.push_back(std::move(step));
  }
  return true;
}

void ScriptRunner::start() {
  // Keys and shortcuts go to the active window: the steps wait (a while) for the main window to be it.
  const qint64 startedAt = QDateTime::currentMSecsSinceEpoch();
  auto waitForActivation = std::make_shared<std::function<void()>>();
  *waitForActivation = [this, startedAt, waitForActivation] {
    // A message box (or dialog) open already, say one the add-in shows at start-up, is the active window.
    if (!m_window.isActiveWindow() && !QApplication::activeModalWidget() &&
        QDateTime::currentMSecsSinceEpoch() - startedAt < 5000) {
      m_window.activateWindow();
      QTimer::singleShot(50, this, *waitForActivation);
      return;
    }
    tick();
  };
  QTimer::singleShot(20, this, *waitForActivation);
}

void ScriptRunner::schedule(int delayMs) {
  // A fresh single-shot timer each time: a step blocked in a dialog's loop must not hold back the next one.
  QTimer::singleShot(delayMs, this, [this] { tick(); });
}

bool ScriptRunner::answerOpenMessageBox() {
  auto* box = qobject_cast<QMessageBox*>(QApplication::activeModalWidget());
  if (!box || !m_ui.hasQueuedAnswer()) return false;
  const int answer = m_ui.takeQueuedAnswer();
  if (QAbstractButton* button = box->button(buttonOfAnswer(answer))) {
    button->click();
  } else {
    box->reject();
  }
  return true;
}

void ScriptRunner::tick() {
  if (m_finished) return;
  if (m_starting && !QApplication::activeModalWidget()) return schedule(10);
  if (answerOpenMessageBox()) return schedule(10);
  if (m_next >= m_steps.size()) return finish(0);
  const size_t index = m_next++;
  const ScriptStep& step = m_steps[index];
  try {
    // The next step is due whatever this one does; if it opens a dialog, the next one runs in its loop.
    // A wait only puts the next step off, while the IDE (and its add-in's timers) runs on.
    bool timed = false;
    const int waitMs = step.command == QLatin1StringView("wait") ? step.arguments[0].toInt(&timed) : 0;
    schedule(timed ? std::max(0, waitMs) : 10);
    if (const std::optional<QString> notReady = execute(step)) {
      const qint64 now = QDateTime::currentMSecsSinceEpoch();
      if (m_waitingSince < 0) m_waitingSince = now;
      if (now - m_waitingSince > m_patienceMs)
        return finish(1, QStringLiteral("%1:%2: %3").arg(m_name).arg(step.line).arg(*notReady));
      m_next = index;  // again on the next tick
      return;
    }
    m_waitingSince = -1;
  } catch (const StepError& error) {
    return finish(1, QStringLiteral("%1:%2: %3").arg(m_name).arg(step.line).arg(error.message));
  } catch (const ide::Error& error) {
    return finish(1, QStringLiteral("%1:%2: %3").arg(m_name).arg(step.line).arg(error.description()));
  }
}

void ScriptRunner::finish(int exitCode, const QString& error) {
  if (m_finished) return;
  if (exitCode == 0) {
    if (QWidget* open = QApplication::activeModalWidget()) {
      exitCode = 1;
      const QString title = open->windowTitle().isEmpty() ? open->objectName() : open->windowTitle();
      if (auto* box = qobject_cast<QMessageBox*>(open))
        m_error = QStringLiteral("%1: the script ended while a message box is open: %2: %3")
                      .arg(m_name, title, QString(box->text()).replace(u'\n', QStringLiteral("\\n")));
      else
        m_error = QStringLiteral("%1: the script ended while the dialog \"%2\" is open").arg(m_name, title);
      std::fprintf(stderr, "%s\n", qPrintable(m_error));
    }
  }
  m_finished = true;
  if (!error.isEmpty()) m_error = error;
  if (!error.isEmpty()) std::fprintf(stderr, "%s\n", qPrintable(error));
  std::fflush(stdout);
  std::fflush(stderr);
  Q_EMIT finished(exitCode);
  // Dialogs still open are closed so that every loop can end; whatever opens another is closed too.
  const auto closeAll = [exitCode, exit = m_exitOnFinish] {
    while (QWidget* modal = QApplication::activeModalWidget()) {
      if (auto* dialog = qobject_cast<QDialog*>(modal))
        dialog->reject();
      else
        modal->close();
      if (QApplication::activeModalWidget() == modal) break;
    }
    if (exit) QCoreApplication::exit(exitCode);
  };
  closeAll();
  if (m_exitOnFinish) {
    connect(&m_closer, &QTimer::timeout, this, closeAll);
    m_closer.start();
  }
}

void ScriptRunner::noteMessage(const QString& title, const QString& text) {
  m_lastMessage = text;
  QString shown = text;
  shown.replace(u'\n', QStringLiteral("\\n"));
  std::printf("msgbox: %s: %s\n", qPrintable(title), qPrintable(shown));
  std::fflush(stdout);
}

bool ScriptRunner::eventFilter(QObject* watched, QEvent* event) {
  // Message boxes shown by others than the IDE's user interface (an add-in's own) are printed as well.
  if (event->type() == QEvent::Show)
    if (auto* box = qobject_cast<QMessageBox*>(watched);
        box && !box->property(QtUserInterface::kOwnBoxProperty).toBool())
      noteMessage(box->windowTitle(), box->text());
  return QObject::eventFilter(watched, event);
}

std::vector<QWidget*> ScriptRunner::dialogs() const {
  std::vector<QWidget*> result;
  if (QWidget* modal = QApplication::activeModalWidget()) result.push_back(modal);
  // Windows of their own (an add-in's modeless window too), not splash screens, menus or tooltips.
  for (QWidget* top : QApplication::topLevelWidgets()) {
    const Qt::WindowType type = top->windowType();
    if (top->isVisible() && top != &m_window &&
        std::find(result.begin(), result.end(), top) == result.end() && type != Qt::SplashScreen &&
        type != Qt::Popup && type != Qt::ToolTip)
      result.push_back(top);
  }
  return result;
}

QWidget* ScriptRunner::findWidget(const QString& name) const {
  // The Object and Procedure boxes are the active code window's, filled with what they offer now.
  if (CodeWindow* code = dialogs().empty() ? m_window.windows().activeCodeWindow() : nullptr) {
    for (QComboBox* box : {code->objectList(), code->procedureList()}) {
      if (box->objectName() != name) continue;
      code->fillLists();
      return box;
    }
  }
  std::vector<QWidget*> tops = dialogs();
  tops.push_back(&m_window);
  for (QWidget* top : tops) {
    if (top->objectName() == name) return top;
    for (QWidget* child : top->findChildren<QWidget*>(name))
      if (child->isVisible()) return child;
  }
  return nullptr;
}

std::optional<QString> ScriptRunner::execute(const ScriptStep& step) {
  const Commands::Entry* command = Commands::find(step.command);
  if (!command) fail(QStringLiteral("unknown command \"%1\"").arg(step.command));
  if (auto* box = qobject_cast<QMessageBox*>(QApplication::activeModalWidget());
      box && !command->whileABoxIsOpen)
    return QStringLiteral("a message box is open: \"%1\"").arg(box->text());
  m_notReady.reset();
  command->run(*this, step.arguments);
  return std::exchange(m_notReady, std::nullopt);
}

}  // namespace desktop
