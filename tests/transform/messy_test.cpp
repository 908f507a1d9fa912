// SPDX-License-Identifier: MIT
// Properties of the code index and the four walks on generated modules written the way real VB6 code is:
// conditional compilation around whole procedures and around headers, continuations after a blank or a
// tab, continued comments, one-line procedures, labels, numeric labels and their jumps, Type and Enum
// blocks, nested blocks, member names like keywords, letters of the ANSI code page.
#include "modelfixture.h"
#include "syntax/line.h"
#include "transform/indentwalk.h"
#include "transform/numberwalk.h"
#include "transform/numindent.h"

#include <gtest/gtest.h>

#include <random>

namespace transform {

using namespace walk;
namespace {

using test::Ide;
using test::linesOf;

/// A random module, how many procedures it declares (alternative headers of one procedure count once), and
/// the level of indentation each line should get, known from how it was generated.
class MessyModule {
 public:
  explicit MessyModule(quint32 seed) : m_random(seed) {
    declarations();
    const int count = 1 + below(5);
    for (int i = 0; i < count; ++i)
      procedureShape();
    if (chance(30)) add(u"' fim do módulo"_qs);
  }

  QStringList lines;
  int procedures = 0;
  static constexpr int kAsWritten = -2, kUnknown = -1;
  std::vector<int> levels;

 private:
  bool chance(int percent) { return int(m_random() % 100) < percent; }
  int below(int n) { return int(m_random() % unsigned(n)); }
  template <size_t N>
  QString pick(const char16_t* const (&texts)[N]) {
    return QString::fromUtf16(texts[below(int(N))]);
  }
  void add(const QString& line, int level = kAsWritten) {
    lines << line;
    levels.push_back(level);
  }
  // A line of a procedure body, carelessly indented, `deeper` levels below the current one.
  void code(const QString& text, int deeper = 0) {
    add(indent() + text, m_level < 0 ? kUnknown : m_level + deeper);
  }
  QString indent() { return pick({u"", u"    ", u"\t", u"  \t", u"        "}); }
  QString mark() { return pick({u" _", u"\t_", u"  _", u" \t_"}); }
  QString name() {
    return pick({u"Calcula", u"ModificadorDaño", u"Conecta", u"Render", u"Ação", u"Get_Value"}) +
           QString::number(++m_names);
  }

  void declarations() {
    if (chance(70)) add(u"Option Explicit"_qs);
    const int count = below(6);
    for (int i = 0; i < count; ++i) {
      switch (below(7)) {
        case 0:
          add(u"Private m_Valor As Long"_qs);
          break;
        case 1:
          add(u"Public Const TAXA = 1 ' taxa _"_qs), add(u"   continua o comentário"_qs, kUnknown);
          break;
        case 2:
          add(u"Private Type TPonto"_qs), add(u"    X As Long"_qs, 1), add(u"End Type"_qs);
          break;
        case 3:
          add(u"Public Enum ECor"_qs), add(u"    corAzul = 1"_qs, 1), add(u"End Enum"_qs);
          break;
        case 4:
          add(u"#Const DEPURA = 1"_qs);
          break;
        case 5:
          add(u"Private Declare Function GetTickCount Lib \"kernel32\" () As Long"_qs);
          break;
        default:
          add(u"Dim sCaminho As String,"_qs + mark()), add(u"\tsNome As String"_qs, 1);
          break;
      }
    }
  }

  void procedureShape() {
    add(QString());
    if (chance(20)) add(u"' procedimento"_qs, kAsWritten);
    const QString procName = name();
    const bool function = chance(40);
    switch (below(6)) {
      case 0:  // one line, as interface classes are written
        add(u"Public Sub "_qs + procName + u"(ByVal d As Long): End Sub"_qs);
        ++procedures;
        return;
      case 1:  // the same procedure in two branches, one of them compiled
        add(u"#If DEPURA Then"_qs);
        procedure(procName, function);
        add(u"#Else"_qs);
        procedure(procName, function);
        add(u"#End If"_qs);
        return;
      case 2: {  // one body under alternative headers
        add(u"#If Win64 Then"_qs);
        headerLines(procName, function);
        add(u"#Else"_qs, kUnknown);
        headerLines(procName, function);
        add(u"#End If"_qs, kUnknown);
        body(procName, function, false);
        ++procedures;
        return;
      }
      default:
        procedure(procName, function);
        return;
    }
  }

  void headerLines(const QString& procName, bool function) {
    const QString scope = pick({u"", u"Public ", u"Private "});
    const QString kind = function ? u"Function "_qs : u"Sub "_qs;
    if (chance(30)) {
      add(scope + kind + procName + u"(ByVal a As Long,"_qs + mark());
      add(u"        ByVal b As String)"_qs + (function ? u" As Long"_qs : QString()), m_header);
    } else {
      add(scope + kind + procName + u"(ByVal a As Long)"_qs + (function ? u" As Long"_qs : QString()));
    }
  }

  void procedure(const QString& procName, bool function) {
    m_header = 1;
    m_headerStart = lines.size();
    headerLines(procName, function);
    m_header = kUnknown;
    body(procName, function);
    ++procedures;
  }

  // A numeric label sets a number column for the whole procedure: its levels are not checked.
  void body(const QString& procName, bool function, bool checked = true) {
    m_label = 0;
    m_level = checked ? 1 : kUnknown;
    if (chance(40)) {
      m_label = 100 * (1 + below(9));
      m_level = kUnknown;
      for (qsizetype i = m_headerStart; i < lines.size(); ++i)
        levels[size_t(i)] = std::min(levels[size_t(i)], int(kUnknown));
      code(u"On Error GoTo "_qs + QString::number(m_label));
    }
    block(procName, 0);
    if (m_label) {
      code(u"Exit "_qs + (function ? u"Function"_qs : u"Sub"_qs));
      add(chance(50) ? QString::number(m_label) + u":"_qs : QString::number(m_label) + u" Resume Next"_qs,
          kUnknown);
    }
    if (chance(20)) add(QString());
    add(function ? u"End Function"_qs : u"End Sub"_qs);
  }

  void block(const QString& procName, int depth) {
    const int count = 1 + below(5);
    for (int i = 0; i < count; ++i)
      (depth < 3 && chance(30)) ? nested(procName, depth + 1) : statement(procName);
  }

  // The body of a block, `deeper` levels below its opener.
  void inner(const QString& procName, int depth, int deeper = 1) {
    const int level = m_level;
    if (m_level >= 0) m_level += deeper;
    block(procName, depth);
    m_level = level;
  }

  void nested(const QString& procName, int depth) {
    switch (below(6)) {
      case 0:
        code(u"If a > 1 Then"_qs);
        inner(procName, depth);
        if (chance(50)) code(u"ElseIf a = 0 Then"_qs), inner(procName, depth);
        if (chance(50)) code(u"Else"_qs), inner(procName, depth);
        code(u"End If"_qs);
        break;
      case 1:
        code(u"For i = 1 To a"_qs), inner(procName, depth), code(u"Next i"_qs);
        break;
      case 2:
        code(u"Do While a > 0"_qs), inner(procName, depth), code(u"Loop"_qs);
        break;
      case 3:  // Case lines one level in, their bodies two
        code(u"Select Case a"_qs);
        code(u"Case 1, 2"_qs, 1), inner(procName, depth, 2);
        code(u"Case Else"_qs, 1), inner(procName, depth, 2);
        code(u"End Select"_qs);
        break;
      case 4:
        code(u"With oPedido"_qs), code(u".Print \"a\""_qs, 1), inner(procName, depth);
        code(u"End With"_qs);
        break;
      default:
        code(u"#If DEPURA Then"_qs), inner(procName, depth), code(u"#End If"_qs);
        break;
    }
  }

  // Continuation lines one level in; a continued comment goes on as a continued statement does.
  void statement(const QString& procName) {
    switch (below(12)) {
      case 0:
        code(u"x = a + 1"_qs);
        break;
      case 1:
        code(u"x = a +"_qs + mark()), code(u"2"_qs, 1);
        break;
      case 2:
        code(u"y = Soma(1,"_qs + mark()), add(u"20 + a, 3)"_qs, m_level < 0 ? kUnknown : m_level + 1);
        break;
      case 3:
        code(u"' nota _"_qs), add(u"   segue a nota"_qs, m_level < 0 ? kUnknown : m_level + 1);
        break;
      case 4:
        code(u"Rem GoTo 10"_qs);
        break;
      case 5:
        add(u"Saida:"_qs, m_level);
        break;
      case 6:
        code(u"MsgBox \"a: b ' c _\" & s ' fim"_qs);
        break;
      case 7:
        code(u"If a Then x = 1 Else x = 2"_qs);
        break;
      case 8:
        code(u"oPedido.Name = ModificadorDaño: rs.Close"_qs);
        break;
      case 9:
        code(procName + u" = x"_qs);
        break;
      case 10:
        code(u": x = 1"_qs);
        break;
      default:
        code(u"Debug.Print Err.Number"_qs);
        break;
    }
  }

  std::mt19937 m_random;
  int m_names = 0;
  int m_label = 0;
  int m_level = kUnknown;
  int m_header = kUnknown;  // the level of a header's continuation lines, where known
  qsizetype m_headerStart = 0;
};

/// Each line without its line number and leading blanks; a continuation line keeps a leading number.
QStringList withoutNumbers(const QStringList& lines) {
  QStringList code;
  bool continuation = false;
  for (const QString& line : lines) {
    QStringView text = QStringView(line).sliced(syntax::leadingBlanks(line).size());
    if (!continuation) {
      if (const syntax::NumberPrefix prefix = syntax::numberPrefix(text);
          prefix && prefix.form != syntax::NumberPrefix::Form::Alone)
        text = prefix.rest.sliced(syntax::leadingBlanks(prefix.rest).size());
    }
    continuation = syntax::continues(line);
    code << text.toString();
  }
  return code;
}

/// The first line where two texts differ, or nothing.
std::string firstDifference(const QStringList& got, const QStringList& expected) {
  for (qsizetype i = 0; i < std::max(got.size(), expected.size()); ++i) {
    const QString a = got.value(i, u"<none>"_qs), b = expected.value(i, u"<none>"_qs);
    if (a != b) return QStringLiteral("line %1: \"%2\" instead of \"%3\"").arg(i + 1).arg(a, b).toStdString();
  }
  return {};
}

struct Transforms {
  Ide ide;
  WalkContext context{u"frmLinNumbers"_qs, nullptr, nullptr};
  int failures = 0;
  int staleIndexes = 0;
  int needlessEdits = 0;
  Transforms() {
    context.onFailure = [this](const WalkFailure&) { ++failures; };
    context.onLineSkipped = [this](const WalkFailure&) { ++failures; };
  }
  template <typename Walk>
  QStringList apply(const QStringList& lines, Walk walk) {
    auto module = ide.addModule(lines);
    const quint64 before = Ide::edits(module);
    walk(module);
    const QStringList result = linesOf(*module);
    // A line the walk would not change is not replaced.
    if (result == lines && Ide::edits(module) != before) ++needlessEdits;
    // The index the edits kept up to date answers as one built afresh from the result.
    if (module->Procedures() != ide.addModule(result)->Procedures()) ++staleIndexes;
    return result;
  }
  QStringList number(const QStringList& l) {
    return apply(l, [&](auto& m) { NumberingWalk(context, 10, 10).NumberModule(m, true); });
  }
  QStringList unnumber(const QStringList& l) {
    return apply(l, [&](auto& m) { NumberingWalk(context, 10, 10).NumberModule(m, false); });
  }
  QStringList indent(const QStringList& l, IndentMode mode = IndentMode::Spaces) {
    return apply(l, [&](auto& m) { IndentationWalk(context, mode, 4).IndentModule(m); });
  }
  QStringList numIndent(const QStringList& l) {
    return apply(
        l, [&](auto& m) { NumIndentWalk(context, 10000, 5, IndentMode::Tabs, 4, true).NumIndentModule(m); });
  }
  /// What number-and-indent does, in two runs: numbering as it numbers, then indenting as it indents.
  QStringList numberThenIndent(const QStringList& l) {
    const QStringList numbered =
        apply(l, [&](auto& m) { NumberingWalk(context, 10000, 5).NumberModule(m, true); });
    return indent(numbered, IndentMode::Tabs);
  }
};

TEST(MessyModules, TheIndexAndTheWalksKeepTheirInvariants) {
  // QUIMBEL_SEED replays one module; a failure names the seed that made it.
  const quint32 first =
      qEnvironmentVariableIsSet("QUIMBEL_SEED") ? qEnvironmentVariableIntValue("QUIMBEL_SEED") : 1;
  const quint32 count = qEnvironmentVariableIsSet("QUIMBEL_SEED") ? 1 : 3000;
  for (quint32 seed = first; seed < first + count; ++seed) {
    const MessyModule generated(seed);
    SCOPED_TRACE(testing::Message() << "QUIMBEL_SEED=" << seed << "\n"
                                    << generated.lines.join(u'\n').toStdString());
    Transforms t;
    // The procedures cover the module below the declarations, each at its own place.
    auto module = t.ide.addModule(generated.lines);
    ASSERT_EQ(linesOf(*module), generated.lines);
    const std::vector<ide::ProcExtent> extents = module->Procedures();
    ASSERT_EQ(int(extents.size()), generated.procedures);
    int next = module->CountOfDeclarationLines() + 1;
    for (const ide::ProcExtent& extent : extents) {
      ASSERT_EQ(extent.startLine, next) << extent.name.toStdString();
      ASSERT_GT(extent.countLines, 0);
      next += extent.countLines;
    }
    ASSERT_EQ(next, module->CountOfLines() + 1);

    const QStringList numbered = t.number(generated.lines);
    ASSERT_EQ(firstDifference(t.number(numbered), numbered), "") << "numbering twice";
    ASSERT_EQ(firstDifference(t.unnumber(numbered), generated.lines), "") << "numbers taken off again";
    const QStringList indented = t.indent(generated.lines);
    ASSERT_EQ(firstDifference(t.indent(indented), indented), "") << "indenting twice";
    const QStringList tabbed = t.indent(generated.lines, IndentMode::Tabs);
    const QStringList both = t.numIndent(generated.lines);
    // Where the shape tells the level, the line has that many units (four spaces or a tab) and its text.
    for (qsizetype i = 0; i < generated.lines.size(); ++i) {
      const int level = generated.levels[size_t(i)];
      const QString& line = generated.lines[i];
      const QString text = line.sliced(syntax::leadingBlanks(line).size());
      if (level == MessyModule::kAsWritten) {
        ASSERT_EQ(indented[i], line) << "line " << i + 1;
        ASSERT_EQ(tabbed[i], line) << "line " << i + 1;
      } else if (level >= 0) {
        ASSERT_EQ(indented[i], QString(4 * level, u' ') + text) << "line " << i + 1;
        ASSERT_EQ(tabbed[i], QString(level, u'\t') + text) << "line " << i + 1;
        // Numbered and indented, a procedure's line has a column of six holding its number or blanks (none
        // when nothing in the procedure takes a number), then the same levels.
        if (level > 0 && i >= module->CountOfDeclarationLines() && both[i] != QString(level, u'\t') + text) {
          ASSERT_GT(both[i].size(), 6) << "line " << i + 1;
          const QString column = both[i].first(6);
          ASSERT_TRUE(column == QString(6, u' ') || (column.first(5).toInt() >= 10000 && column[5] == u' '))
              << "line " << i + 1 << ": " << both[i].toStdString();
          ASSERT_EQ(both[i].sliced(6), QString(level, u'\t') + text) << "line " << i + 1;
        }
      }
    }
    ASSERT_EQ(firstDifference(t.indent(tabbed, IndentMode::Tabs), tabbed), "") << "indenting twice, tabs";
    ASSERT_EQ(firstDifference(t.numIndent(both), both), "") << "number-and-indent twice";
    ASSERT_EQ(firstDifference(t.numberThenIndent(generated.lines), both), "") << "numbering, then indenting";
    // Nothing but numbers and leading blanks changes.
    const QStringList code = withoutNumbers(generated.lines);
    for (const QStringList* changed : {&numbered, &indented, &tabbed, &both})
      ASSERT_EQ(firstDifference(withoutNumbers(*changed), code), "");
    ASSERT_EQ(t.failures, 0);
    ASSERT_EQ(t.staleIndexes, 0);
    ASSERT_EQ(t.needlessEdits, 0);
  }
}

}  // namespace
}  // namespace transform
