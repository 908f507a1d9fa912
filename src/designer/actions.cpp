// SPDX-License-Identifier: MIT
#include "designer/actions.h"

#include "common/errors.h"
#include "common/uiutils.h"
#include "designer/values.h"
#include "syntax/line.h"
#include "syntax/text.h"

#include <QStringList>

#include <optional>
#include <utility>
#include <vector>

namespace designer {
namespace {

const QString kModule = QStringLiteral("basGlobals");

/// Appends `word`, the control's new name in place of its old one (also in its event procedures' names:
/// Text1_Change).
void appendRenamed(QString& out, QStringView word, QStringView oldName, QStringView newName) {
  if (word == oldName) {
    out += newName;
  } else if (word.size() > oldName.size() + 1 && word.startsWith(oldName) && word[oldName.size()] == u'_') {
    out += newName;
    out += word.sliced(oldName.size());
  } else {
    out += word;
  }
}

/// Appends a comment with the control renamed in its words too.
void appendRenamedComment(QString& out, QStringView comment, QStringView oldName, QStringView newName) {
  qsizetype i = 0;
  while (i < comment.size()) {
    qsizetype end = i;
    while (end < comment.size() && syntax::isIdentifierChar(comment[end]))
      ++end;
    if (end == i) {
      out += comment[i++];
      continue;
    }
    appendRenamed(out, comment.sliced(i, end - i), oldName, newName);
    i = end;
  }
}

/// The control the writers write for: its form's code module, its name and whether it is an element of
/// a control array (its Index reads as 0 or more).
struct Target {
  ide::Ref<ide::CodeModule> module;
  QString name;
  bool array = false;
  QString className;
};

Target targetOf(ide::VBControl& ctl) {
  Target target;
  target.module = ctl.Parent()->Parent()->CodeModule();
  if (!target.module) ide::raise(ide::err::ObjectRequired);
  target.name = ctl.name();
  target.className = ctl.ClassName();
  try {
    bool ok = false;
    const int index = ctl.Properties()->Item(QStringLiteral("Index"))->Value().toInt(&ok);
    target.array = ok && index >= 0;
  } catch (const std::exception&) {
    target.array = false;
  }
  return target;
}

// Intrinsic classes that never take the focus, and so have no GotFocus or LostFocus event.
const QStringList kNoFocusEvents = {QStringLiteral("Label"), QStringLiteral("Frame"), QStringLiteral("Image"),
                                    QStringLiteral("Timer"), QStringLiteral("Shape"), QStringLiteral("Line"),
                                    QStringLiteral("Menu"),  QStringLiteral("Data")};

/// The control's BackColor as a VB literal ("&H8000000F&"), as the form holds it; nothing when the
/// control has no BackColor (a Timer, an Image, a scroll bar) or it cannot be read.
std::optional<QString> backColorLiteral(ide::VBControl& ctl) {
  try {
    const QVariant value = ctl.Properties()->Item(QStringLiteral("BackColor"))->Value();
    bool ok = false;
    std::optional<double> number = value.toDouble(&ok);
    if (!ok) {  // a control the tables do not know keeps the literal of its description
      const QString literal = value.toString();
      number = vbNumber(literal.endsWith(u'&') ? literal.chopped(1) : literal);
    }
    if (!number) return std::nullopt;
    return QStringLiteral("&H%1&").arg(QString::number(quint32(qint64(*number)), 16).toUpper());
  } catch (const std::exception&) {
    return std::nullopt;
  }
}

bool hasMember(ide::CodeModule& module, const QString& name) {
  const auto members = module.Members();
  const int count = members->Count();
  for (int i = 1; i <= count; ++i)
    if (members->Item(i)->Name().compare(name, Qt::CaseInsensitive) == 0) return true;
  return false;
}

/// Appends the lines after the module's last line, in one insertion.
void append(ide::CodeModule& module, const QStringList& lines) {
  module.InsertLines(module.CountOfLines() + 1, lines.join(QStringLiteral("\r\n")));
}

}  // namespace

QString renameControlInLine(QStringView line, QStringView oldName, QStringView newName) {
  if (oldName.isEmpty()) return line.toString();
  QString out;
  out.reserve(line.size() + 16);
  syntax::Tokenizer tokens(line);
  syntax::Token token;
  qsizetype done = 0;
  while (tokens.next(token)) {
    out += line.sliced(done, token.start - done);
    const QStringView text = line.sliced(token.start, token.length);
    if (token.type == syntax::Token::Type::Word)
      appendRenamed(out, text, oldName, newName);
    else if (token.type == syntax::Token::Type::Comment)
      appendRenamedComment(out, text, oldName, newName);
    else
      out += text;  // strings keep what they say
    done = token.start + token.length;
  }
  out += line.sliced(done);
  return out;
}

// ---------------------------------------------------------------------------------------------------
// The events

void DesignerActions::FormAdded(const ide::Ref<ide::VBComponent>& component) {
  if (component->Type() != ide::ComponentType::VBForm) return;
  if (!m_options.FormsPosition && !m_options.FormsBorder) return;
  // A form added from its file is not new: its layout is the programmer's.
  if (!component->FileNames(1).isEmpty()) return;
  const auto properties = component->Properties();
  if (properties->Item(QStringLiteral("MDIChild"))->Value().toBool()) return;
  if (m_options.FormsPosition) properties->Item(QStringLiteral("StartUpPosition"))->setValue(2);
  if (m_options.FormsBorder) properties->Item(QStringLiteral("BorderStyle"))->setValue(1);
}

bool DesignerActions::selectsText(const QString& className) const {
  return m_options.SelectTextBoxOnFocus &&
         (className == QLatin1StringView("TextBox") || className == QLatin1StringView("ComboBox"));
}

void DesignerActions::ControlAdded(const ide::Ref<ide::VBControl>& control) {
  bool applyColour = false;
  QString colour;
  if (m_options.ShowProperties && m_showProperties) {
    const PropsChoice choice = m_showProperties(control);
    if (!choice.Cancelled) {
      if (choice.EnterAsTab) IncluirCodigoDeTabParaKeyReturn(*control);
      applyColour = choice.BackColorOnFocus;
      colour = choice.FocusColor;
    }
  }
  const QString className = control->ClassName();
  if (className == QLatin1StringView("Label") && m_options.LabelsTransparent)
    control->Properties()->Item(QStringLiteral("BackStyle"))->setValue(0);
  if (className == QLatin1StringView("TextBox") && m_options.ClearTextProperty)
    control->Properties()->Item(QStringLiteral("Text"))->setValue(QString());
  if (applyColour || selectsText(className)) IncluirCodigoGotLostFocus(*control, applyColour, colour);
  if (m_options.TextBoxUpperCase && className == QLatin1StringView("TextBox"))
    IncluirCodigoTextUcase(*control);
}

void DesignerActions::ControlRenamed(const ide::Ref<ide::VBControl>& control, const QString& oldName, int) {
  if (!m_options.RenameInCodeOnControlRenamed) return;
  const QString newName = control->name();
  if (oldName.isEmpty() || newName == oldName) return;  // only its index changed
  common::CHourGlass hourglass(m_ui);
  const auto module = control->Parent()->Parent()->CodeModule();
  if (!module) return;

  struct Change {
    int line;
    QString before;
    QString after;
  };
  std::vector<Change> changes;
  const int count = module->CountOfLines();
  for (int line = 1; line <= count; ++line) {
    QString text = module->Lines(line, 1);
    if (!text.contains(oldName, Qt::CaseSensitive)) continue;
    QString renamed = renameControlInLine(text, oldName, newName);
    if (renamed != text) changes.push_back({line, std::move(text), std::move(renamed)});
  }
  size_t written = 0;
  try {
    for (; written < changes.size(); ++written)
      module->ReplaceLine(changes[written].line, changes[written].after);
  } catch (...) {
    // A module that refuses a line keeps its code as it was.
    while (written > 0) {
      --written;
      try {
        module->ReplaceLine(changes[written].line, changes[written].before);
      } catch (const std::exception& failure) {
        common::logFailure(failure, kModule, QStringLiteral("ControlRenamed"), __LINE__);
      }
    }
    throw;
  }
}

// ---------------------------------------------------------------------------------------------------
// The code writers

void DesignerActions::IncluirCodigoDeTabParaKeyReturn(ide::VBControl& ctl) {
  try {
    static const QStringList kNoEnterKey = {QStringLiteral("Label"),         QStringLiteral("Frame"),
                                            QStringLiteral("PictureBox"),    QStringLiteral("Image"),
                                            QStringLiteral("CommandButton"), QStringLiteral("Timer")};
    const Target target = targetOf(ctl);
    if (kNoEnterKey.contains(target.className)) return;
    if (hasMember(*target.module, target.name + QStringLiteral("_KeyDown"))) return;
    const QString signature = target.array
                                  ? QStringLiteral("(Index As Integer, KeyCode As Integer, Shift As Integer)")
                                  : QStringLiteral("(KeyCode As Integer, Shift As Integer)");
    append(*target.module,
           {QStringLiteral("Private Sub ") + target.name + QStringLiteral("_KeyDown") + signature,
            QStringLiteral("   If (KeyCode = vbKeyReturn) Then"), QStringLiteral("       KeyCode = 0"),
            QStringLiteral("       SendKeys \"{Tab}\", False"), QStringLiteral("   End If"),
            QStringLiteral("End Sub")});
  } catch (const std::exception& failure) {
    throw common::recordError(failure, kModule, QStringLiteral("IncluirCodigoDeTabParaKeyReturn"), __LINE__);
  }
}

void DesignerActions::IncluirCodigoGotLostFocus(ide::VBControl& ctl, bool applyColour,
                                                const QString& colour) {
  try {
    const Target target = targetOf(ctl);
    const bool selectText = selectsText(target.className);
    // The colour comes and goes only on a control that has a BackColor and focus events to change it
    // in; the LostFocus gives back the colour the control had, not always the window's white.
    const std::optional<QString> ownColour =
        applyColour && !kNoFocusEvents.contains(target.className) ? backColorLiteral(ctl) : std::nullopt;
    applyColour = ownColour.has_value();
    if (!applyColour && !selectText) return;
    if (hasMember(*target.module, target.name + QStringLiteral("_GotFocus")) ||
        hasMember(*target.module, target.name + QStringLiteral("_LostFocus")))
      return;
    const QString self = target.array ? target.name + QStringLiteral("(Index)") : target.name;
    QStringList lines = {
        QStringLiteral("Private Sub ") + target.name +
            (target.array ? QStringLiteral("_GotFocus(Index as Integer)") : QStringLiteral("_GotFocus()")),
        QStringLiteral("   On Error Resume Next")};
    if (applyColour) lines << QStringLiteral("   ") + self + QStringLiteral(".BackColor = ") + colour;
    if (selectText) {
      lines << QStringLiteral("   ") + self + QStringLiteral(".SelStart = 0");
      lines << QStringLiteral("   ") + self + QStringLiteral(".SelLength = Len(") + self +
                   QStringLiteral(".Text)");
    }
    lines << QStringLiteral("End Sub");
    if (applyColour) {
      lines << QStringLiteral("Private Sub ") + target.name +
                   (target.array ? QStringLiteral("_LostFocus(Index As Integer)")
                                 : QStringLiteral("_LostFocus()"));
      lines << QStringLiteral("   ") + self + QStringLiteral(".BackColor = ") + *ownColour;
      lines << QStringLiteral("End Sub");
    }
    append(*target.module, lines);
  } catch (const std::exception& failure) {
    throw common::recordError(failure, kModule, QStringLiteral("IncluirCodigoGotLostFocus"), __LINE__);
  }
}

void DesignerActions::IncluirCodigoTextUcase(ide::VBControl& ctl) {
  try {
    const Target target = targetOf(ctl);
    if (hasMember(*target.module, target.name + QStringLiteral("_KeyPress"))) return;
    append(*target.module,
           {QStringLiteral("Private Sub ") + target.name +
                (target.array ? QStringLiteral("_KeyPress(Index As Integer, KeyAscii As Integer)")
                              : QStringLiteral("_KeyPress(KeyAscii As Integer)")),
            QStringLiteral("   KeyAscii = Asc(UCase(Chr(KeyAscii)))"), QStringLiteral("End Sub")});
  } catch (const std::exception& failure) {
    throw common::recordError(failure, kModule, QStringLiteral("IncluirCodigoTextUcase"), __LINE__);
  }
}

}  // namespace designer
