// SPDX-License-Identifier: MIT
#include "textins/textinsertion.h"

#include "common/errors.h"
#include "common/strings.h"
#include "host/files/ansi.h"
#include "syntax/declarations.h"
#include "textins/texts.h"

#include <QLoggingCategory>

#include <algorithm>
#include <optional>
#include <utility>

namespace textins {
namespace {

// IDE failures that insertion does without; QT_LOGGING_RULES="quimbel.textins.debug=true" shows them.
Q_LOGGING_CATEGORY(lcInsertion, "quimbel.textins", QtInfoMsg)

/// %1 the character (empty when it has no picture of its own), %2 its code.
constexpr char16_t kNotAnsi[] =
    u"O caractere \u201C%1\u201D (U+%2) não existe na página de código do Windows (1252) em que o VB grava "
    u"o código: um módulo com ele não poderia ser salvo.";

enum class Token {
  ProjectName,
  ModuleName,
  ProcedureName,
  ProcedureType,
  ControlName,
  ComputerName,
  UserName,
  Date,
  Time,
  Marker,
  Other
};

Token tokenOf(QStringView token) {
  static constexpr std::pair<const char*, Token> kTokens[] = {{"{ProjectName}", Token::ProjectName},
                                                              {"{ModuleName}", Token::ModuleName},
                                                              {"{ProcedureName}", Token::ProcedureName},
                                                              {"{ProcedureType}", Token::ProcedureType},
                                                              {"{ControlName}", Token::ControlName},
                                                              {"{ComputerName}", Token::ComputerName},
                                                              {"{UserName}", Token::UserName},
                                                              {"{Date}", Token::Date},
                                                              {"{Time}", Token::Time},
                                                              {"{SS}", Token::Marker},
                                                              {"{SE}", Token::Marker},
                                                              {"{C}", Token::Marker}};
  for (const auto& [name, kind] : kTokens)
    if (token.compare(QLatin1StringView(name), Qt::CaseInsensitive) == 0) return kind;
  return Token::Other;
}

constexpr QLatin1StringView kSelectionStart("{SS}");
constexpr QLatin1StringView kSelectionEnd("{SE}");
constexpr QLatin1StringView kCaret("{C}");

/// Runs an IDE call whose failure the caller does without.
template <class Call>
void ignoringFailure(Call call) {
  try {
    call();
  } catch (const std::exception& failure) {
    qCDebug(lcInsertion) << "ignored:" << failure.what();
  }
}

/// The locale's long time format without the time zone, which a long time of the system leaves out.
QString longTimeFormat(const QLocale& locale) {
  const QString format = locale.timeFormat(QLocale::LongFormat);
  QString result;
  bool quoted = false;
  for (const QChar c : format) {
    if (c == u'\'') quoted = !quoted;
    if (quoted || c != u't') result += c;
  }
  return result.remove(QStringLiteral("()")).trimmed();
}

/// "Sub" or "Function" when the statement declares one.
QString declaredKind(const QString& statement) {
  const auto header = syntax::parseProcHeader(statement);
  if (!header || header->kind != ide::ProcKind::Proc) return {};
  return header->isFunction ? QStringLiteral("Function") : QStringLiteral("Sub");
}

QString projectName(const ide::Ref<ide::VBComponent>& component) {
  const auto collection = component ? component->Collection() : nullptr;
  const auto project = collection ? collection->Parent() : nullptr;
  if (!project) ide::raise(ide::err::ObjectVariableNotSet);
  return project->Name();
}

/// The control whose event procedure holds the line: the name before the first "_" of a Sub statement,
/// when the component's designer has a control of that name.
std::optional<QString> controlName(const ide::Ref<ide::VBComponent>& component, const ProcInfo& info) {
  if (info.Kind != QLatin1StringView("Sub") || !component) return std::nullopt;
  std::optional<QString> found;
  ignoringFailure([&] {
    const auto designer = component->Designer();
    if (!designer) return;
    const auto header = syntax::parseProcHeader(component->CodeModule()->Lines(info.BodyLine, 1));
    const qsizetype underscore = header ? header->name.indexOf(u'_') : -1;
    const QString candidate = underscore < 0 ? QString() : header->name.first(underscore);
    for (const auto& control : designer->VBControls()->items()) {
      const QString name = control->name();
      if (name.compare(candidate, Qt::CaseInsensitive) == 0) {
        found = name;
        return;
      }
    }
  });
  return found;
}

/// The 1-based positions in the final text where the markers stood (0: none). A position names the
/// character that followed the marker.
struct Markers {
  qsizetype caret = 0;
  qsizetype start = 0;
  qsizetype end = 0;
};

/// Takes the markers out of `text`. The caret wins over a selection; an end before the start does not
/// count; a start without an end selects to the end of the text.
Markers takeMarkers(QString& text) {
  constexpr auto anyCase = Qt::CaseInsensitive;
  Markers markers;
  if (text.contains(kCaret, anyCase)) {
    text.remove(kSelectionStart, anyCase).remove(kSelectionEnd, anyCase);
    markers.caret = text.indexOf(kCaret, 0, anyCase) + 1;
    text.remove(kCaret, anyCase);
  } else if (const qsizetype first = text.indexOf(kSelectionStart, 0, anyCase); first >= 0) {
    QString left = text.left(first);
    left.remove(kSelectionEnd, anyCase);
    text = left + text.mid(first);
    markers.start = left.size() + 1;
    text.remove(kSelectionStart, anyCase);
    const qsizetype end = text.indexOf(kSelectionEnd, 0, anyCase);
    text.remove(kSelectionEnd, anyCase);
    markers.end = end >= 0 ? end + 1 : text.size() + 1;
  } else if (const qsizetype end = text.indexOf(kSelectionEnd, 0, anyCase); end >= 0) {
    markers.end = end + 1;
    text.remove(kSelectionEnd, anyCase);
  }
  return markers;
}

/// Where position `position` of the inserted `text` lands: the number of line breaks before it (CR LF, CR
/// or LF, as the code module splits lines) and its column; on the first line the text began at
/// `startColumn`.
std::pair<int, int> placeOf(QStringView text, qsizetype position, int startColumn) {
  const qsizetype index = position - 1;
  int lines = 0;
  qsizetype lineStart = 0;
  for (qsizetype i = 0; i < index && i < text.size(); ++i) {
    if (text[i] != u'\r' && text[i] != u'\n') continue;
    if (text[i] == u'\r' && i + 1 < text.size() && text[i + 1] == u'\n') ++i;
    ++lines;
    lineStart = i + 1;
  }
  if (lines == 0) return {0, static_cast<int>(startColumn + index)};
  return {lines, static_cast<int>(std::max<qsizetype>(1, index - lineStart + 1))};
}

}  // namespace

std::optional<char32_t> firstNonAnsi(QStringView text) {
  qsizetype bad = -1;
  if (host::encodeAnsi(text, &bad) || bad < 0 || bad >= text.size()) return std::nullopt;
  const QChar high = text[bad];
  if (high.isHighSurrogate() && bad + 1 < text.size() && text[bad + 1].isLowSurrogate())
    return QChar::surrogateToUcs4(high, text[bad + 1]);
  return high.unicode();
}

QString nonAnsiMessage(char32_t character) {
  const bool printable = QChar::isPrint(character) && !QChar::isSurrogate(character);
  return QString::fromUtf16(kNotAnsi).arg(
      printable ? QString::fromUcs4(&character, 1) : QString(),
      QStringLiteral("%1").arg(static_cast<uint>(character), 4, 16, QChar(u'0')).toUpper());
}

ProcInfo GetProcInfo(const ide::Ref<ide::VBComponent>& component, int line) {
  ProcInfo info;
  ide::Ref<ide::CodeModule> module;
  ignoringFailure([&] {
    if (component) module = component->CodeModule();
  });
  if (!module) return info;
  ignoringFailure([&] {
    ide::ProcKind kind = ide::ProcKind::Proc;
    info.Name = module->ProcOfLine(line, kind);
  });
  if (info.Name.isEmpty()) return info;

  ignoringFailure([&] { info.StartLine = module->ProcStartLine(info.Name, ide::ProcKind::Proc); });
  if (info.StartLine > 0) {
    QString statement;
    ignoringFailure([&] { info.BodyLine = module->ProcBodyLine(info.Name, ide::ProcKind::Proc); });
    ignoringFailure([&] { statement = module->Lines(info.BodyLine, 1); });
    info.Kind = declaredKind(statement);
    return info;
  }
  for (const ide::ProcKind kind : {ide::ProcKind::Get, ide::ProcKind::Let, ide::ProcKind::Set}) {
    ignoringFailure([&] { info.StartLine = module->ProcStartLine(info.Name, kind); });
    if (info.StartLine <= 0) continue;
    ignoringFailure([&] { info.CountLines = module->ProcCountLines(info.Name, kind); });
    if (info.StartLine <= line && line < info.StartLine + info.CountLines) {
      info.Kind = QStringLiteral("Property");
      break;
    }
  }
  return info;
}

TextInsertion::TextInsertion(ide::VBE& vbe, InsertionContext context)
    : m_vbe(vbe), m_context(std::move(context)) {}

bool TextInsertion::markersStay(const ide::Ref<ide::VBComponent>& component) const {
  if (!component || !m_context.LastWindowType || m_context.LastWindowType() != 0) return false;
  bool same = false;
  ignoringFailure([&] {
    const auto pane = m_vbe.ActiveCodePane();
    same = pane && pane->CodeModule()->Parent() == component;
  });
  return same;
}

QString TextInsertion::ExpandPlaceholders(const QString& Text, const ide::Ref<ide::VBComponent>& Component,
                                          int Line) const {
  if (Text.isEmpty()) return {};
  try {
    QString text = Text;
    const ProcInfo info = GetProcInfo(Component, Line);
    const QDateTime now = m_context.now();
    std::optional<bool> markersStayed;
    qsizetype open = text.indexOf(u'{');
    while (open >= 0) {
      const qsizetype close = text.indexOf(u'}', open);
      if (close < 0) break;
      const qsizetype length = close - open + 1;
      std::optional<QString> value;
      bool remove = false;
      switch (tokenOf(QStringView(text).sliced(open, length))) {
        case Token::ProjectName:
          value = projectName(Component);
          break;
        case Token::ModuleName:
          if (Component) value = Component->Name();
          break;
        case Token::ProcedureName:
          if (!info.Name.isEmpty()) value = info.Name;
          break;
        case Token::ProcedureType:
          if (!info.Kind.isEmpty()) value = info.Kind;
          break;
        case Token::ControlName:
          value = controlName(Component, info);
          break;
        case Token::ComputerName:
          value = m_context.ComputerName;
          break;
        case Token::UserName:
          value = m_context.UserName;
          break;
        case Token::Date:
          value = m_context.locale.toString(now.date(), QLocale::ShortFormat);
          break;
        case Token::Time:
          value = m_context.locale.toString(now.time(), longTimeFormat(m_context.locale));
          break;
        case Token::Marker:
          if (!markersStayed) markersStayed = markersStay(Component);
          remove = !*markersStayed;
          break;
        case Token::Other:
          break;
      }
      if (remove) {
        // A token right after a removed marker is still found.
        text.remove(open, length);
        open = text.indexOf(u'{', open);
      } else if (value) {
        // Values are not expanded again, whatever braces a name may hold.
        text.replace(open, length, *value);
        open = text.indexOf(u'{', open + value->size());
      } else {
        open = text.indexOf(u'{', open + 1);
      }
    }
    return text;
  } catch (const std::exception& failure) {
    throw common::recordError(failure, QStringLiteral("basTextInsertion"),
                              QStringLiteral("ExpandPlaceholders"), __LINE__);
  }
}

void TextInsertion::InsertCode(const ide::Ref<ide::CodeModule>& CodeModule, const QString& Text) {
  try {
    int startLine = 0, startColumn = 0, endLine = 0, endColumn = 0;
    CodeModule->CodePane()->GetSelection(startLine, startColumn, endLine, endColumn);
    const QString first = CodeModule->Lines(startLine, 1);
    const QString before = startColumn < 2 ? QString() : first.left(startColumn - 1);
    if (startLine == endLine) {
      if (startColumn == endColumn && first.isEmpty())
        CodeModule->InsertLines(startLine, Text);
      else
        CodeModule->ReplaceLine(startLine, before + Text + first.mid(endColumn - 1));
      return;
    }
    const QString last = CodeModule->Lines(endLine, 1);
    const QString replacement = before + Text + last.mid(endColumn - 1);
    // A selection that ends at the start of an empty line leaves that line.
    const int removed = last.isEmpty() ? endLine - startLine - 1 : endLine - startLine;
    // The replacement goes in before the lines below it go: a module that refuses it (the joined line
    // too long, the program running) then still has every line it had.
    const int countBefore = CodeModule->CountOfLines();
    if (first.isEmpty())
      CodeModule->InsertLines(startLine, replacement);
    else
      CodeModule->ReplaceLine(startLine, replacement);
    const int added = CodeModule->CountOfLines() - countBefore;
    if (removed > 0) CodeModule->DeleteLines(startLine + 1 + added, removed);
  } catch (const std::exception& failure) {
    throw common::recordError(failure, QStringLiteral("basTextInsertion"), QStringLiteral("InsertCode"),
                              __LINE__);
  }
}

void TextInsertion::InsertText(const QString& Text) {
  try {
    const auto component = m_vbe.SelectedVBComponent();
    const auto selected = component ? component->CodeModule() : nullptr;
    if (!selected) ide::raise(ide::err::ObjectVariableNotSet);
    int startLine = 0, startColumn = 0, endLine = 0, endColumn = 0;
    selected->CodePane()->GetSelection(startLine, startColumn, endLine, endColumn);
    // A failed expansion ends here, before the selection is touched.
    QString text = ExpandPlaceholders(Text, component, startLine);
    // Code the IDE could not save is not put in: a text stored elsewhere, or a name it expanded to.
    if (const std::optional<char32_t> character = firstNonAnsi(text)) {
      m_vbe.Platform().ui().MsgBox(
          common::LoadResString(kInsertionFailed) + QStringLiteral("\n\n") + nonAnsiMessage(*character),
          ide::mb::Exclamation, common::title());
      return;
    }
    const auto pane = m_vbe.ActiveCodePane();
    if (!pane) ide::raise(ide::err::ObjectVariableNotSet);
    const auto module = pane->CodeModule();
    if (text.isEmpty()) {
      // An empty text removes the selection; with nothing selected there is nothing to replace.
      if (startLine != endLine || startColumn != endColumn) InsertCode(module, text);
      return;
    }
    const Markers markers = takeMarkers(text);
    // A failed insertion ends here too: the markers' places would be wrong.
    InsertCode(module, text);
    if (markers.caret) {
      const auto [lines, column] = placeOf(text, markers.caret, startColumn);
      pane->SetSelection(startLine + lines, column, startLine + lines, column);
    } else if (markers.start) {
      const auto [startLines, selectionStart] = placeOf(text, markers.start, startColumn);
      const auto [endLines, selectionEnd] = placeOf(text, markers.end, startColumn);
      pane->SetSelection(startLine + startLines, selectionStart, startLine + endLines, selectionEnd);
    } else if (markers.end) {
      const auto [endLines, selectionEnd] = placeOf(text, markers.end, startColumn);
      pane->SetSelection(startLine, startColumn, startLine + endLines, selectionEnd);
    }
  } catch (const std::exception& failure) {
    common::recordError(failure, QStringLiteral("basTextInsertion"), QStringLiteral("InsertText"), __LINE__);
    common::logLastError();
    m_vbe.Platform().ui().MsgBox(common::LoadResString(kInsertionFailed), ide::mb::Exclamation,
                                 common::title());
  }
}

}  // namespace textins
