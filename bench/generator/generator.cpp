// SPDX-License-Identifier: MIT
// The synthetic project generator. Every component's code is written to an exact line budget by a
// recursive statement writer, so the requested size is met in one pass; each file is built in memory as
// Windows-1252 bytes and written once.
#include "generator.h"

#include <QByteArray>
#include <QByteArrayView>
#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <QStringEncoder>
#include <QTemporaryDir>

#include <algorithm>
#include <array>
#include <deque>
#include <stdexcept>
#include <string>
#include <vector>

namespace gen {
namespace {

// splitmix64: small and fast, and its sequence is fixed by its definition, unlike the standard
// distributions, whose results differ between library implementations.
class Random {
 public:
  explicit Random(quint64 seed) : m_state(seed) {}

  quint64 next() {
    quint64 z = (m_state += 0x9E3779B97F4A7C15ull);
    z = (z ^ (z >> 30)) * 0xBF58476D1CE4E5B9ull;
    z = (z ^ (z >> 27)) * 0x94D049BB133111EBull;
    return z ^ (z >> 31);
  }

  /// A number in [lo, hi]; the modulo bias is far too small to matter here.
  int between(int lo, int hi) { return lo + int(next() % quint64(qint64(hi) - lo + 1)); }
  bool chance(int percent) { return int(next() % 100) < percent; }

  template <typename T, size_t N>
  const T& pick(const std::array<T, N>& items) {
    return items[next() % N];
  }

 private:
  quint64 m_state;
};

// Independent streams per component, so that one component's content does not depend on how many
// numbers the components before it drew.
quint64 streamSeed(quint32 seed, quint64 stream) {
  Random mixer((quint64(seed) << 32) ^ (stream * 0xD1B54A32D192ED03ull));
  return mixer.next();
}

// ---------------------------------------------------------------------------------------------------------
// Vocabulary. The accented texts are encoded to Windows-1252 once; everything else is ASCII.

constexpr std::array<const char*, 20> kStringTexts = {"Operação concluída",
                                                      "Não foi possível gravar o arquivo",
                                                      "Preço inválido",
                                                      "Atenção: saldo insuficiente",
                                                      "Código não encontrado",
                                                      "Relatório de vendas",
                                                      "Situação do pedido",
                                                      "Endereço de entrega",
                                                      "Informações do cliente",
                                                      "Cálculo do imposto",
                                                      "Emissão da nota fiscal",
                                                      "Conexão recusada pelo servidor",
                                                      "Número de série",
                                                      "Promoção válida até o fim do mês",
                                                      "Cliente",
                                                      "Total do dia",
                                                      "Registro gravado",
                                                      "Pedido cancelado",
                                                      "Estoque mínimo atingido",
                                                      "Você não tem permissão"};

constexpr std::array<const char*, 20> kCommentTexts = {"Ajusta o saldo antes de gravar",
                                                       "Verifica se o código já existe",
                                                       "Calcula o desconto conforme a tabela de preços",
                                                       "Atualiza a situação do pedido",
                                                       "Não remover: usado pelo relatório mensal",
                                                       "Percorre os itens e soma os valores",
                                                       "TODO: revisar o cálculo das comissões",
                                                       "Converte a data para o padrão do banco",
                                                       "Mantém compatibilidade com a versão anterior",
                                                       "Evita divisão por zero quando não há itens",
                                                       "Limpa os campos antes de carregar",
                                                       "Lê a configuração da seção padrão",
                                                       "Valida o CPF informado",
                                                       "Só grava quando houve alteração",
                                                       "Regra pedida pelo setor financeiro",
                                                       "Retorna zero quando o cliente não existe",
                                                       "Mesma lógica da rotina de importação",
                                                       "Aqui o valor já vem com o imposto",
                                                       "Ordem importa: primeiro o cabeçalho, depois os itens",
                                                       "Último ajuste feito na migração de 2004"};

constexpr std::array<const char*, 20> kNouns = {
    "Clientes",   "Pedidos",  "Estoque",    "Vendas",    "Compras",  "Fiscal",   "Financeiro",
    "Relatorios", "Cadastro", "Integracao", "Logistica", "Contabil", "Usuarios", "Seguranca",
    "Produtos",   "Precos",   "Comissoes",  "Agenda",    "Cobranca", "Notas"};

constexpr std::array<const char*, 16> kVerbs = {
    "Calcular", "Atualizar", "Validar", "Gravar",    "Carregar",  "Processar", "Verificar", "Montar",
    "Exportar", "Importar",  "Limpar",  "Preencher", "Consultar", "Registrar", "Ajustar",   "Converter"};

constexpr std::array<const char*, 8> kPropertyNames = {"Descricao",  "Codigo", "Valor",      "Situacao",
                                                       "Observacao", "Limite", "Quantidade", "Ativo"};

QByteArray toAnsi(const char* utf8) {
  QStringEncoder encoder("Windows-1252");
  QByteArray bytes = encoder.encode(QString::fromUtf8(utf8));
  // Every text above is in the code page; a failure here is a programming error, not bad input.
  if (!encoder.isValid() || encoder.hasError()) throw std::logic_error("text outside Windows-1252");
  return bytes;
}

struct Vocabulary {
  std::vector<QByteArray> strings;
  std::vector<QByteArray> comments;
  QByteArray options = toAnsi("Opções");
  QByteArray description = toAnsi("Descrição:");
  QByteArray save = toAnsi("Gravar");
  QByteArray remove = toAnsi("Excluir");
  QByteArray cancel = toAnsi("Cancelar");
  QByteArray active = toAnsi("Ativo");

  Vocabulary() {
    for (const char* text : kStringTexts)
      strings.push_back(toAnsi(text));
    for (const char* text : kCommentTexts)
      comments.push_back(toAnsi(text));
  }
};

const Vocabulary& vocabulary() {
  static const Vocabulary words;
  return words;
}

// ---------------------------------------------------------------------------------------------------------
// Output. Header lines are written as they are; code lines are counted.

class CodeWriter {
 public:
  explicit CodeWriter(QByteArray& out) : m_out(out) {}

  /// Starts a code line at `indent`; a non-zero `number` is written in front as a line number.
  CodeWriter& start(int indent, int number = 0) {
    if (number > 0) {
      const QByteArray digits = QByteArray::number(number);
      m_out.append(digits);
      m_out.append(std::max<qsizetype>(1, indent - digits.size()), ' ');
    } else if (indent > 0) {
      m_out.append(indent, ' ');
    }
    return *this;
  }
  CodeWriter& operator<<(QByteArrayView text) {
    m_out.append(text);
    return *this;
  }
  CodeWriter& operator<<(int value) {
    m_out.append(QByteArray::number(value));
    return *this;
  }
  void end() {
    m_out.append("\r\n", 2);
    ++m_lines;
  }
  void line(int indent, QByteArrayView text, int number = 0) {
    start(indent, number) << text;
    end();
  }
  void blank() { end(); }
  qint64 lines() const { return m_lines; }

 private:
  QByteArray& m_out;
  qint64 m_lines = 0;
};

void headerLine(QByteArray& out, QByteArrayView text) {
  out.append(text);
  out.append("\r\n", 2);
}

// One property of a form description, in VB's layout: three blanks per level, the name padded to 16.
void formProperty(QByteArray& out, int level, QByteArrayView name, QByteArrayView value) {
  out.append(3 * level, ' ');
  out.append(name);
  out.append(std::max<qsizetype>(0, 16 - name.size()), ' ');
  out.append("=   ");
  out.append(value);
  out.append("\r\n", 2);
}

void formProperty(QByteArray& out, int level, QByteArrayView name, int value) {
  formProperty(out, level, name, QByteArray::number(value));
}

// VB writes a blank after the control name on every Begin line.
void formBegin(QByteArray& out, int level, QByteArrayView type, QByteArrayView name) {
  out.append(3 * level, ' ');
  out.append("Begin ");
  out.append(type);
  out.append(' ');
  out.append(name);
  out.append(" \r\n");
}

void formEnd(QByteArray& out, int level) {
  out.append(3 * level, ' ');
  out.append("End\r\n");
}

QByteArray quoted(QByteArrayView text) {
  QByteArray result;
  result.reserve(text.size() + 2);
  result.append('"');
  result.append(text);
  result.append('"');
  return result;
}

// ---------------------------------------------------------------------------------------------------------
// Components.

enum class ComponentKind { Module, Class, Form };
enum class ProcKind { Sub, Function, PropertyGet, PropertyLet, PropertySet };

struct ProcPlan {
  QByteArray scope;
  ProcKind kind = ProcKind::Sub;
  QByteArray name;
  std::vector<QByteArray> params;
  QByteArray returnType;  // Function and Property Get
  QByteArray finalLine;   // when set, the body's last line (a return value, a field assignment)
  int maxLines = 0;       // 0: drawn from the general length distribution
};

// What the statement writer may refer to at the current point of a body.
struct BlockContext {
  bool locals = false;
  bool numbered = false;
  int nextNumber = 10;
  int forDepth = 0;
  bool inForEach = false;
  int withDepth = 0;
  std::vector<char> loops;  // 'F' or 'D', innermost last
  QByteArrayView exitKeyword;
};

constexpr int kMaxDepth = 5;
constexpr int kMinProcedureLines = 3;  // header, one body line, End
constexpr int kBodyIndent = 4;
constexpr std::array<const char*, 5> kLoopVariables = {"i", "j", "k", "n", "p"};
constexpr std::array<const char*, 5> kReturnTypes = {"Long", "String", "Currency", "Boolean", "Variant"};

QByteArrayView procKeyword(ProcKind kind) {
  switch (kind) {
    case ProcKind::Sub:
      return "Sub";
    case ProcKind::Function:
      return "Function";
    case ProcKind::PropertyGet:
      return "Property Get";
    case ProcKind::PropertyLet:
      return "Property Let";
    case ProcKind::PropertySet:
      return "Property Set";
  }
  return "Sub";
}

QByteArrayView exitKeyword(ProcKind kind) {
  switch (kind) {
    case ProcKind::Sub:
      return "Sub";
    case ProcKind::Function:
      return "Function";
    default:
      return "Property";
  }
}

class ComponentWriter {
 public:
  ComponentWriter(ComponentKind kind, int index, quint64 seed, QByteArray& out)
      : m_kind(kind), m_index(index), m_rng(seed), m_code(out) {}

  /// Writes exactly `target` code lines (at least one). `withMain` puts Sub Main first when it fits.
  void writeCode(qint64 target, bool withMain);

  bool wroteMain() const { return m_wroteMain; }
  qint64 lines() const { return m_code.lines(); }

 private:
  void writeDeclarations(int budget, bool withProcedures, const std::vector<QByteArray>& fields);
  void writeTrailingLines(int count);
  int drawProcedureLength(const ProcPlan& plan);
  ProcPlan genericProcedure();
  void planProperties(qint64 target, std::deque<ProcPlan>& queue, std::vector<QByteArray>& fields);

  void writeProcedure(const ProcPlan& plan, int lines);
  void writeHeader(const ProcPlan& plan, int headerLines);
  void writeBody(const ProcPlan& plan, int budget);
  void writeReturn(const ProcPlan& plan, const BlockContext& ctx);

  void writeBlock(int indent, int depth, int budget, BlockContext& ctx);
  int writeStatement(int indent, int depth, int budget, BlockContext& ctx);
  int writeCompound(int indent, int depth, int budget, BlockContext& ctx);
  void writeIf(int indent, int depth, int size, BlockContext& ctx);
  void writeSelect(int indent, int depth, int size, BlockContext& ctx);
  void writeFor(int indent, int depth, int size, BlockContext& ctx);
  void writeForEach(int indent, int depth, int size, BlockContext& ctx);
  void writeDo(int indent, int depth, int size, BlockContext& ctx);
  void writeWith(int indent, int depth, int size, BlockContext& ctx);
  void writeDirective(int indent, int depth, int size, BlockContext& ctx);
  void writeContinued(int indent, int size, BlockContext& ctx);
  void writeSimple(int indent, BlockContext& ctx);
  void writeComment(int indent);

  void appendCondition(const BlockContext& ctx);
  void appendString();
  int chooseSize(int minimum, int budget);
  std::vector<int> split(int total, int parts);
  int lineNumber(BlockContext& ctx);

  ComponentKind m_kind;
  int m_index;
  Random m_rng;
  CodeWriter m_code;
  int m_procedureCount = 0;
  bool m_wroteMain = false;
};

int ComponentWriter::lineNumber(BlockContext& ctx) {
  if (!ctx.numbered) return 0;
  const int number = ctx.nextNumber;
  ctx.nextNumber += 10;
  return number;
}

void ComponentWriter::appendString() {
  const auto& strings = vocabulary().strings;
  m_code << "\"" << strings[m_rng.next() % strings.size()] << "\"";
}

void ComponentWriter::writeComment(int indent) {
  const auto& comments = vocabulary().comments;
  m_code.start(indent) << "' " << comments[m_rng.next() % comments.size()];
  m_code.end();
}

void ComponentWriter::appendCondition(const BlockContext& ctx) {
  switch (m_rng.between(0, ctx.locals ? 7 : 3)) {
    case 0:
      m_code << "m_lngContador > " << m_rng.between(1, 500);
      break;
    case 1:
      m_code << "Len(m_strNome) = 0";
      break;
    case 2:
      m_code << "m_curSaldo < " << m_rng.between(0, 1000);
      break;
    case 3:
      m_code << "Not m_colItens Is Nothing";
      break;
    case 4:
      m_code << "Len(sTexto) > " << m_rng.between(1, 80);
      break;
    case 5:
      m_code << "cTotal >= " << m_rng.between(10, 5000);
      break;
    case 6:
      m_code << "i Mod " << m_rng.between(2, 7) << " = 0";
      break;
    default:
      m_code << "IsArray(vValor)";
      break;
  }
}

// Block sizes lean towards small, with an occasional block that takes most of what is left.
int ComponentWriter::chooseSize(int minimum, int budget) {
  int high = budget;
  if (high > 16 && m_rng.chance(70)) high = std::max(minimum, high / m_rng.between(2, 5));
  const int span = high - minimum;
  return minimum + std::min(m_rng.between(0, span), m_rng.between(0, span));
}

std::vector<int> ComponentWriter::split(int total, int parts) {
  std::vector<int> sizes(parts, 1);
  int rest = total - parts;
  for (int i = 0; i < parts - 1 && rest > 0; ++i) {
    const int give = std::min(rest, m_rng.between(0, 2 * rest / (parts - i)));
    sizes[i] += give;
    rest -= give;
  }
  sizes[parts - 1] += rest;
  return sizes;
}

void ComponentWriter::writeBlock(int indent, int depth, int budget, BlockContext& ctx) {
  while (budget > 0)
    budget -= writeStatement(indent, depth, budget, ctx);
}

int ComponentWriter::writeStatement(int indent, int depth, int budget, BlockContext& ctx) {
  if (depth < kMaxDepth && budget >= 3 && m_rng.chance(budget >= 12 ? 40 : 25)) {
    return writeCompound(indent, depth, budget, ctx);
  }
  const int roll = m_rng.between(0, 99);
  if (roll < 6 && budget >= 2) {
    const int size = m_rng.between(2, std::min(4, budget));
    writeContinued(indent, size, ctx);
    return size;
  }
  if (roll < 13) {
    writeComment(indent);
  } else if (roll < 16) {
    m_code.blank();
  } else {
    writeSimple(indent, ctx);
  }
  return 1;
}

int ComponentWriter::writeCompound(int indent, int depth, int budget, BlockContext& ctx) {
  for (;;) {
    switch (m_rng.between(0, 9)) {
      case 0:
      case 1:
      case 2: {
        const int size = chooseSize(3, budget);
        writeIf(indent, depth, size, ctx);
        return size;
      }
      case 3:
        if (budget >= 6) {
          const int size = chooseSize(6, budget);
          writeSelect(indent, depth, size, ctx);
          return size;
        }
        break;
      case 4:
        if (ctx.locals) {
          const int size = chooseSize(3, budget);
          writeFor(indent, depth, size, ctx);
          return size;
        }
        break;
      case 5:
        if (ctx.locals && !ctx.inForEach) {
          const int size = chooseSize(3, budget);
          writeForEach(indent, depth, size, ctx);
          return size;
        }
        break;
      case 6:
      case 7: {
        const int size = chooseSize(3, budget);
        writeDo(indent, depth, size, ctx);
        return size;
      }
      case 8: {
        const int size = chooseSize(3, budget);
        writeWith(indent, depth, size, ctx);
        return size;
      }
      default: {
        const int size = chooseSize(3, budget);
        writeDirective(indent, depth, size, ctx);
        return size;
      }
    }
  }
}

void ComponentWriter::writeIf(int indent, int depth, int size, BlockContext& ctx) {
  const bool continued = size >= 4 && m_rng.chance(10);
  const int fixed = 2 + (continued ? 1 : 0);  // If (one or two lines) and End If
  const int maxBranches = std::max(1, std::min(4, (size - fixed + 1) / 2));
  const int branches = m_rng.between(1, maxBranches);
  const bool hasElse = branches >= 2 && m_rng.chance(65);
  const std::vector<int> bodies = split(size - fixed - (branches - 1), branches);

  m_code.start(indent, lineNumber(ctx)) << "If ";
  appendCondition(ctx);
  if (continued) {
    m_code << " And _";
    m_code.end();
    m_code.start(indent + 3);
    appendCondition(ctx);
  }
  m_code << " Then";
  m_code.end();
  writeBlock(indent + 4, depth + 1, bodies[0], ctx);
  for (int b = 1; b < branches; ++b) {
    if (b == branches - 1 && hasElse) {
      m_code.line(indent, "Else");
    } else {
      m_code.start(indent) << "ElseIf ";
      appendCondition(ctx);
      m_code << " Then";
      m_code.end();
    }
    writeBlock(indent + 4, depth + 1, bodies[b], ctx);
  }
  m_code.line(indent, "End If");
}

void ComponentWriter::writeSelect(int indent, int depth, int size, BlockContext& ctx) {
  const int cases = m_rng.between(2, std::min(6, (size - 2) / 2));
  const bool hasElse = m_rng.chance(70);
  const std::vector<int> bodies = split(size - 2 - cases, cases);

  m_code.start(indent, lineNumber(ctx)) << "Select Case ";
  if (ctx.locals && m_rng.chance(50)) {
    m_code << "n Mod " << m_rng.between(3, 9);
  } else if (m_rng.chance(50)) {
    m_code << "m_lngContador Mod " << m_rng.between(3, 9);
  } else {
    m_code << "Len(m_strNome)";
  }
  m_code.end();
  int value = 0;
  for (int c = 0; c < cases; ++c) {
    if (c == cases - 1 && hasElse) {
      m_code.line(indent + 4, "Case Else");
    } else {
      m_code.start(indent + 4) << "Case ";
      switch (m_rng.between(0, 2)) {
        case 0:
          m_code << value;
          value += 1;
          break;
        case 1:
          m_code << value << ", " << value + 1;
          value += 2;
          break;
        default:
          m_code << value << " To " << value + 3;
          value += 4;
          break;
      }
      m_code.end();
    }
    writeBlock(indent + 8, depth + 1, bodies[c], ctx);
  }
  m_code.line(indent, "End Select");
}

void ComponentWriter::writeFor(int indent, int depth, int size, BlockContext& ctx) {
  const QByteArrayView variable = kLoopVariables[ctx.forDepth];
  m_code.start(indent, lineNumber(ctx)) << "For " << variable << " = ";
  if (m_rng.chance(50)) {
    m_code << "1 To " << m_rng.between(2, 100);
  } else if (m_rng.chance(50)) {
    m_code << "1 To m_lngContador";
  } else {
    m_code << m_rng.between(10, 50) << " To 0 Step -" << m_rng.between(1, 3);
  }
  m_code.end();
  ++ctx.forDepth;
  ctx.loops.push_back('F');
  writeBlock(indent + 4, depth + 1, size - 2, ctx);
  ctx.loops.pop_back();
  --ctx.forDepth;
  m_code.start(indent) << "Next";
  if (m_rng.chance(70)) m_code << " " << variable;
  m_code.end();
}

void ComponentWriter::writeForEach(int indent, int depth, int size, BlockContext& ctx) {
  m_code.line(indent, "For Each vValor In m_colItens", lineNumber(ctx));
  ctx.inForEach = true;
  ctx.loops.push_back('F');
  writeBlock(indent + 4, depth + 1, size - 2, ctx);
  ctx.loops.pop_back();
  ctx.inForEach = false;
  m_code.line(indent, m_rng.chance(60) ? "Next vValor" : "Next");
}

void ComponentWriter::writeDo(int indent, int depth, int size, BlockContext& ctx) {
  const bool testAtEnd = m_rng.chance(40);
  if (testAtEnd) {
    m_code.line(indent, "Do", lineNumber(ctx));
  } else {
    m_code.start(indent, lineNumber(ctx)) << (m_rng.chance(80) ? "Do While " : "Do Until ");
    appendCondition(ctx);
    m_code.end();
  }
  ctx.loops.push_back('D');
  writeBlock(indent + 4, depth + 1, size - 2, ctx);
  ctx.loops.pop_back();
  if (testAtEnd) {
    m_code.start(indent) << (m_rng.chance(70) ? "Loop Until " : "Loop While ");
    appendCondition(ctx);
    m_code.end();
  } else {
    m_code.line(indent, "Loop");
  }
}

void ComponentWriter::writeWith(int indent, int depth, int size, BlockContext& ctx) {
  m_code.line(indent, "With m_colItens", lineNumber(ctx));
  ++ctx.withDepth;
  writeBlock(indent + 4, depth + 1, size - 2, ctx);
  --ctx.withDepth;
  m_code.line(indent, "End With");
}

// Conditional compilation inside a body; the branches keep the indentation of the code around them.
void ComponentWriter::writeDirective(int indent, int depth, int size, BlockContext& ctx) {
  const bool withElse = size >= 5 && m_rng.chance(40);
  m_code.line(indent, "#If DEPURACAO Then");
  if (withElse) {
    const std::vector<int> bodies = split(size - 3, 2);
    writeBlock(indent, depth + 1, bodies[0], ctx);
    m_code.line(indent, "#Else");
    writeBlock(indent, depth + 1, bodies[1], ctx);
  } else {
    writeBlock(indent, depth + 1, size - 2, ctx);
  }
  m_code.line(indent, "#End If");
}

void ComponentWriter::writeContinued(int indent, int size, BlockContext& ctx) {
  const QByteArrayView target = ctx.locals ? "sTexto" : "m_strNome";
  m_code.start(indent, lineNumber(ctx)) << target << " = ";
  appendString();
  m_code << " & _";
  m_code.end();
  const int continuation = indent + int(target.size()) + 3;
  for (int i = 1; i < size - 1; ++i) {
    m_code.start(continuation) << "\" \" & ";
    appendString();
    m_code << " & _";
    m_code.end();
  }
  m_code.start(continuation) << (ctx.locals ? "\" \" & CStr(cTotal)" : "\" \" & CStr(m_lngContador)");
  m_code.end();
}

void ComponentWriter::writeSimple(int indent, BlockContext& ctx) {
  m_code.start(indent, lineNumber(ctx));
  if (ctx.withDepth > 0 && m_rng.chance(30)) {
    if (m_rng.chance(50)) {
      m_code << ".Add " << (ctx.locals ? "sTexto" : "m_strNome");
    } else {
      m_code << "If .Count > " << m_rng.between(10, 1000) << " Then .Remove 1";
    }
  } else if (!ctx.loops.empty() && m_rng.chance(8)) {
    m_code << "If ";
    appendCondition(ctx);
    m_code << (ctx.loops.back() == 'F' ? " Then Exit For" : " Then Exit Do");
  } else if (m_kind == ComponentKind::Form && m_rng.chance(20)) {
    switch (m_rng.between(0, 4)) {
      case 0:
        m_code << "txtCampo.Text = m_strNome";
        break;
      case 1:
        m_code << "lblTitulo.Caption = ";
        appendString();
        break;
      case 2:
        m_code << "cmdAcao(" << m_rng.between(0, 2) << ").Enabled = (m_lngContador > 0)";
        break;
      case 3:
        m_code << "lstItens.AddItem m_strNome";
        break;
      default:
        m_code << "chkAtivo.Value = vbChecked";
        break;
    }
  } else if (m_kind == ComponentKind::Class && m_rng.chance(6)) {
    m_code << "RaiseEvent Alterado(\"" << kNouns[m_rng.next() % kNouns.size()] << "\")";
  } else if (m_rng.chance(3)) {
    m_code << "If m_curSaldo < 0 Then Exit " << ctx.exitKeyword;
  } else if (ctx.locals && m_rng.chance(60)) {
    switch (m_rng.between(0, 9)) {
      case 0:
        m_code << "sTexto = ";
        appendString();
        break;
      case 1:
        m_code << "sTexto = sTexto & \" - \" & CStr(i)";
        break;
      case 2:
        m_code << "cTotal = cTotal + " << m_rng.between(1, 999);
        break;
      case 3:
        m_code << "n = n + Len(sTexto)";
        break;
      case 4: {
        const int limit = m_rng.between(10, 200);
        m_code << "If Len(sTexto) > " << limit << " Then sTexto = Left$(sTexto, " << limit << ")";
        break;
      }
      case 5:
        m_code << "vValor = Array(" << m_rng.between(0, 9) << ", " << m_rng.between(10, 99) << ", \"";
        m_code << kNouns[m_rng.next() % kNouns.size()] << "\")";
        break;
      case 6:
        m_code << "cTotal = Round(cTotal * 1." << m_rng.between(10, 99) << ", 2)";
        break;
      case 7:
        m_code << "sTexto = Trim$(UCase$(sTexto))";
        break;
      case 8:
        m_code << "Debug.Print ";
        appendString();
        m_code << "; cTotal";
        break;
      default:
        m_code << "If cTotal < 0 Then cTotal = 0";
        break;
    }
  } else {
    switch (m_rng.between(0, 8)) {
      case 0:
      case 1:
        m_code << "m_lngContador = m_lngContador + 1";
        break;
      case 2:
        m_code << "m_strNome = Trim$(m_strNome)";
        break;
      case 3:
        m_code << "m_strNome = ";
        appendString();
        break;
      case 4:
        m_code << "m_curSaldo = m_curSaldo - " << m_rng.between(1, 500);
        break;
      case 5:
        m_code << "If m_lngContador > " << m_rng.between(10, 9999) << " Then m_lngContador = 0";
        break;
      case 6:
        m_code << "Debug.Print ";
        appendString();
        break;
      case 7:
        m_code << "If m_colItens Is Nothing Then Set m_colItens = New Collection";
        break;
      default:
        m_code << "DoEvents";
        break;
    }
  }
  m_code.end();
}

// ---------------------------------------------------------------------------------------------------------
// Procedures.

ProcPlan ComponentWriter::genericProcedure() {
  static constexpr std::array<const char*, 6> kParams = {
      "ByVal lngCodigo As Long", "ByVal strDescricao As String", "ByRef curValor As Currency",
      "ByVal dtmData As Date",   "ByVal blnAtivo As Boolean",    "ByVal vntChave As Variant"};
  static constexpr std::array<const char*, 2> kOptionalParams = {
      "Optional ByVal blnForcar As Boolean = False", "Optional ByVal lngLimite As Long = 100"};

  ProcPlan plan;
  switch (m_kind) {
    case ComponentKind::Module:
      plan.scope = m_rng.chance(60) ? "Public" : "Private";
      break;
    case ComponentKind::Class: {
      const int roll = m_rng.between(0, 9);
      plan.scope = roll < 6 ? "Public" : (roll < 9 ? "Private" : "Friend");
      break;
    }
    case ComponentKind::Form:
      plan.scope = m_rng.chance(80) ? "Private" : "Public";
      break;
  }
  plan.kind = m_rng.chance(45) ? ProcKind::Function : ProcKind::Sub;
  plan.name = QByteArray(m_rng.pick(kVerbs)) + m_rng.pick(kNouns) + QByteArray::number(++m_procedureCount);
  if (plan.kind == ProcKind::Function) plan.returnType = m_rng.pick(kReturnTypes);

  const int count = m_rng.between(0, 4);
  int first = m_rng.between(0, int(kParams.size()) - 1);
  for (int i = 0; i < count; ++i)
    plan.params.push_back(kParams[(first + i) % kParams.size()]);
  if (m_rng.chance(20)) plan.params.push_back(m_rng.pick(kOptionalParams));
  return plan;
}

// Most procedures are short, a fair number are medium, a few are long and very few very long.
int ComponentWriter::drawProcedureLength(const ProcPlan& plan) {
  if (plan.maxLines > 0) return m_rng.between(kMinProcedureLines, plan.maxLines);
  const int roll = m_rng.between(0, 99);
  if (roll < 55) return m_rng.between(5, 25);
  if (roll < 85) return m_rng.between(26, 80);
  if (roll < 97) return m_rng.between(81, 200);
  return m_rng.between(201, 600);
}

void ComponentWriter::writeHeader(const ProcPlan& plan, int headerLines) {
  QByteArray opening = plan.scope + ' ' + procKeyword(plan.kind).toByteArray() + ' ' + plan.name + '(';
  QByteArray closing = ")";
  if (!plan.returnType.isEmpty()) closing += " As " + plan.returnType;

  const int count = int(plan.params.size());
  const std::vector<int> groups = count == 0 ? std::vector<int>{0} : split(count, headerLines);
  int next = 0;
  for (size_t g = 0; g < groups.size(); ++g) {
    if (g == 0) {
      m_code.start(0) << opening;
    } else {
      m_code.start(int(opening.size()));
    }
    for (int i = 0; i < groups[g]; ++i, ++next) {
      if (i > 0) m_code << ", ";
      m_code << plan.params[next];
    }
    m_code << (g + 1 < groups.size() ? QByteArrayView(", _") : QByteArrayView(closing));
    m_code.end();
  }
}

void ComponentWriter::writeReturn(const ProcPlan& plan, const BlockContext& ctx) {
  if (!plan.finalLine.isEmpty()) {
    m_code.line(kBodyIndent, plan.finalLine, 0);
    return;
  }
  QByteArrayView value;
  if (plan.returnType == "String") {
    value = ctx.locals ? "sTexto" : "m_strNome";
  } else if (plan.returnType == "Long") {
    value = ctx.locals ? "n" : "m_lngContador";
  } else if (plan.returnType == "Currency") {
    value = ctx.locals ? "cTotal" : "m_curSaldo";
  } else if (plan.returnType == "Boolean") {
    value = ctx.locals ? "(cTotal > 0)" : "(m_lngContador > 0)";
  } else {
    value = ctx.locals ? "vValor" : "m_strNome";
  }
  m_code.start(kBodyIndent) << plan.name << " = " << value;
  m_code.end();
}

void ComponentWriter::writeBody(const ProcPlan& plan, int budget) {
  BlockContext ctx;
  ctx.exitKeyword = exitKeyword(plan.kind);
  const bool returns = !plan.finalLine.isEmpty() || !plan.returnType.isEmpty();
  const int reserve = returns ? 1 : 0;

  ctx.locals = budget - reserve >= 10 && m_rng.chance(85);
  if (ctx.locals) {
    m_code.line(kBodyIndent, "Dim i As Long, j As Long, k As Long");
    m_code.line(kBodyIndent, "Dim n As Long, p As Long");
    m_code.line(kBodyIndent, "Dim sTexto As String");
    m_code.line(kBodyIndent, "Dim cTotal As Currency");
    m_code.line(kBodyIndent, "Dim vValor As Variant");
    budget -= 5;
    if (budget - reserve >= 3 && m_rng.chance(60)) {
      m_code.blank();
      --budget;
    }
  }
  ctx.numbered = budget - reserve >= 4 && m_rng.chance(4);

  if (budget - reserve >= 9 && m_rng.chance(22)) {
    m_code.line(kBodyIndent, "On Error GoTo Erro", lineNumber(ctx));
    --budget;
    const int handlerLines = m_rng.between(1, 2);
    const bool blankBeforeLabel = m_rng.chance(60);
    const int tail = 1 + (blankBeforeLabel ? 1 : 0) + 1 + handlerLines;  // Exit, blank, label, handler
    writeBlock(kBodyIndent, 0, budget - reserve - tail, ctx);
    if (returns) writeReturn(plan, ctx);
    m_code.start(kBodyIndent, lineNumber(ctx)) << "Exit " << ctx.exitKeyword;
    m_code.end();
    if (blankBeforeLabel) m_code.blank();
    m_code.line(0, "Erro:");
    m_code.start(kBodyIndent, lineNumber(ctx)) << "Debug.Print ";
    appendString();
    m_code << "; Err.Number; Err.Description";
    m_code.end();
    if (handlerLines == 2) m_code.line(kBodyIndent, "m_lngContador = 0", lineNumber(ctx));
    return;
  }
  writeBlock(kBodyIndent, 0, budget - reserve, ctx);
  if (returns) writeReturn(plan, ctx);
}

void ComponentWriter::writeProcedure(const ProcPlan& plan, int lines) {
  int comments = 0;
  if (lines >= 7 && m_rng.chance(40)) comments = m_rng.between(1, std::min(3, lines - 6));
  const int maxHeaderLines = std::min(3, int(plan.params.size()));
  int headerLines = 1;
  if (maxHeaderLines >= 2 && lines - comments >= 6 && m_rng.chance(18)) {
    headerLines = maxHeaderLines >= 3 && m_rng.chance(35) ? 3 : 2;
  }
  for (int i = 0; i < comments; ++i)
    writeComment(0);
  writeHeader(plan, headerLines);
  writeBody(plan, lines - comments - headerLines - 1);
  m_code.start(0) << "End "
                  << (plan.kind == ProcKind::Sub        ? QByteArrayView("Sub")
                      : plan.kind == ProcKind::Function ? QByteArrayView("Function")
                                                        : QByteArrayView("Property"));
  m_code.end();
}

// ---------------------------------------------------------------------------------------------------------
// Module level.

void ComponentWriter::planProperties(qint64 target, std::deque<ProcPlan>& queue,
                                     std::vector<QByteArray>& fields) {
  const int groups = target >= 60 ? m_rng.between(1, 4) : (target >= 30 ? 1 : 0);
  for (int g = 0; g < groups; ++g) {
    const QByteArray suffix = QByteArray::number(g + 1);
    ProcPlan get;
    get.scope = "Public";
    get.kind = ProcKind::PropertyGet;
    get.maxLines = 12;
    ProcPlan put = get;
    put.maxLines = 10;
    if (m_rng.chance(25)) {
      // An object property: Get and Set.
      get.name = "Itens" + suffix;
      get.returnType = "Collection";
      get.finalLine = "Set " + get.name + " = m_colItens" + suffix;
      put.kind = ProcKind::PropertySet;
      put.name = get.name;
      put.params = {"ByVal Valor As Collection"};
      put.finalLine = "Set m_colItens" + suffix + " = Valor";
      fields.push_back("Private m_colItens" + suffix + " As Collection");
    } else {
      static constexpr std::array<std::array<const char*, 2>, 4> kTypes = {
          {{"String", "str"}, {"Long", "lng"}, {"Currency", "cur"}, {"Boolean", "bln"}}};
      const auto& type = m_rng.pick(kTypes);
      get.name = QByteArray(m_rng.pick(kPropertyNames)) + suffix;
      const QByteArray field = QByteArray("m_") + type[1] + get.name;
      get.returnType = type[0];
      get.finalLine = get.name + " = " + field;
      put.kind = ProcKind::PropertyLet;
      put.name = get.name;
      put.params = {QByteArray("ByVal Valor As ") + type[0]};
      put.finalLine = field + " = Valor";
      fields.push_back("Private " + field + " As " + type[0]);
    }
    queue.push_back(get);
    if (!m_rng.chance(15)) queue.push_back(put);  // otherwise a read-only property
  }
}

void ComponentWriter::writeDeclarations(int budget, bool withProcedures,
                                        const std::vector<QByteArray>& fields) {
  static constexpr std::array<const char*, 5> kDeclares = {
      "Private Declare Function GetTickCount Lib \"kernel32\" () As Long",
      "Private Declare Sub Sleep Lib \"kernel32\" (ByVal dwMilliseconds As Long)",
      "Private Declare Function GetTempPath Lib \"kernel32\" Alias \"GetTempPathA\" (ByVal nBufferLength As "
      "Long, ByVal lpBuffer As String) As Long",
      "Private Declare Sub CopyMemory Lib \"kernel32\" Alias \"RtlMoveMemory\" (Destination As Any, Source "
      "As Any, ByVal Length As Long)",
      "Private Declare Function GetPrivateProfileString Lib \"kernel32\" Alias "
      "\"GetPrivateProfileStringA\" _"};
  static constexpr const char* kDeclareContinuation =
      "    (ByVal lpApplicationName As String, ByVal lpKeyName As Any, ByVal lpDefault As String, ByVal "
      "lpReturnedString As String, ByVal nSize As Long, ByVal lpFileName As String) As Long";

  const bool isClass = m_kind == ComponentKind::Class;
  const int mandatory = 1 + (withProcedures ? 4 + int(fields.size()) + (isClass ? 1 : 0) : 0);
  int free = budget - mandatory;
  auto take = [&](int size, int percent) {
    if (size > free || !m_rng.chance(percent)) return false;
    free -= size;
    return true;
  };
  const bool blankAfterOption = take(1, 70);
  const bool banner = take(3, 40);
  const bool constant = take(1, 25);
  int declares = 0;
  if (m_rng.chance(m_kind == ComponentKind::Module ? 50 : 15)) {
    declares = std::min(m_rng.between(1, 4), free - 1);  // one more line for the blank after them
    if (declares > 0) free -= declares + 1;
  }
  const bool conditional = take(5, 30);
  const bool enumeration = take(5, 20);
  const bool userType = take(5, 15);
  const int constants = free;

  m_code.line(0, "Option Explicit");
  if (blankAfterOption) m_code.blank();
  if (banner) {
    m_code.line(0, "' ------------------------------------------------------------------");
    writeComment(0);
    m_code.line(0, "' ------------------------------------------------------------------");
  }
  if (constant) m_code.line(0, "#Const DEPURACAO = 1");
  if (declares > 0) {
    // Each Declare at most once; the continued one counts two lines and is skipped when only one is left.
    // Lines the pool cannot fill become blank lines after the Declares.
    int left = declares;
    for (size_t d = 0; d < kDeclares.size() && left > 0; ++d) {
      const size_t which = (size_t(m_index) + d) % kDeclares.size();
      if (which == kDeclares.size() - 1) {
        if (left < 2) continue;
        m_code.line(0, kDeclares[which]);
        m_code.line(0, kDeclareContinuation);
        left -= 2;
      } else {
        m_code.line(0, kDeclares[which]);
        --left;
      }
    }
    for (int i = 0; i <= left; ++i)
      m_code.blank();
  }
  for (int c = 0; c < constants; ++c) {
    if (c == 0 && constants >= 2) {
      writeComment(0);
      continue;
    }
    m_code.start(0) << "Private Const LIMITE_" << c << " As Long = " << m_rng.between(1, 10000);
    m_code.end();
  }
  if (conditional) {
    m_code.line(0, "#If DEPURACAO Then");
    m_code.line(0, "Private Const NIVEL_LOG As Long = 2");
    m_code.line(0, "#Else");
    m_code.line(0, "Private Const NIVEL_LOG As Long = 0");
    m_code.line(0, "#End If");
  }
  if (enumeration) {
    m_code.start(0) << "Private Enum Situacao" << m_index;
    m_code.end();
    m_code.start(4) << "sit" << m_index << "Aberta = 0";
    m_code.end();
    m_code.start(4) << "sit" << m_index << "Fechada = 1";
    m_code.end();
    m_code.start(4) << "sit" << m_index << "Cancelada = 2";
    m_code.end();
    m_code.line(0, "End Enum");
  }
  if (userType) {
    m_code.start(0) << "Private Type Registro" << m_index;
    m_code.end();
    m_code.line(4, "Codigo As Long");
    m_code.line(4, "Nome As String * 40");
    m_code.line(4, "Valor As Currency");
    m_code.line(0, "End Type");
  }
  if (withProcedures) {
    if (isClass) m_code.line(0, "Public Event Alterado(ByVal Campo As String)");
    m_code.line(0, "Private m_lngContador As Long");
    m_code.line(0, "Private m_strNome As String");
    m_code.line(0, "Private m_curSaldo As Currency");
    m_code.line(0, "Private m_colItens As Collection");
    for (const QByteArray& field : fields)
      m_code.line(0, field);
  }
}

// Lines after the last procedure: a blank line, then comments.
void ComponentWriter::writeTrailingLines(int count) {
  for (int i = 0; i < count; ++i) {
    if (i == 0 && count > 1) {
      m_code.blank();
    } else {
      writeComment(0);
    }
  }
}

void ComponentWriter::writeCode(qint64 target, bool withMain) {
  std::deque<ProcPlan> queue;
  std::vector<QByteArray> fields;
  if (withMain) {
    ProcPlan main;
    main.scope = "Public";
    main.name = "Main";
    queue.push_back(main);
  }
  if (m_kind == ComponentKind::Form) {
    ProcPlan event;
    event.scope = "Private";
    event.maxLines = 40;
    event.name = "Form_Load";
    queue.push_back(event);
    event.name = "cmdAcao_Click";
    event.params = {"Index As Integer"};
    queue.push_back(event);
    event.params.clear();
    if (m_rng.chance(50)) {
      event.name = "txtCampo_Change";
      queue.push_back(event);
    }
    if (m_rng.chance(50)) {
      event.name = "lstItens_Click";
      queue.push_back(event);
    }
    if (m_rng.chance(40)) {
      event.name = "Form_Unload";
      event.params = {"Cancel As Integer"};
      queue.push_back(event);
    }
  } else if (m_kind == ComponentKind::Class) {
    ProcPlan event;
    event.scope = "Private";
    event.maxLines = 15;
    event.name = "Class_Initialize";
    event.finalLine = "Set m_colItens = New Collection";
    queue.push_back(event);
    event.name = "Class_Terminate";
    event.finalLine = "Set m_colItens = Nothing";
    queue.push_back(event);
    planProperties(target, queue, fields);
  }

  const int mandatory = 1 + 4 + int(fields.size()) + (m_kind == ComponentKind::Class ? 1 : 0);
  if (target < mandatory + 1 + kMinProcedureLines) {
    writeDeclarations(int(target), false, {});
    return;
  }
  const qint64 maxDeclarations = target - 1 - kMinProcedureLines;
  const int declarations = int(std::min<qint64>(maxDeclarations, m_rng.between(mandatory, mandatory + 30)));
  writeDeclarations(declarations, true, fields);

  qint64 remaining = target - declarations;
  while (remaining > 0) {
    const int gap = remaining > 12 && m_rng.chance(10) ? 2 : 1;
    if (remaining < gap + kMinProcedureLines) {
      writeTrailingLines(int(remaining));
      break;
    }
    ProcPlan plan;
    if (queue.empty()) {
      plan = genericProcedure();
    } else {
      plan = queue.front();
      queue.pop_front();
    }
    int lines = int(std::min<qint64>(drawProcedureLength(plan), remaining - gap));
    int trailing = 0;
    const qint64 left = remaining - gap - lines;
    if (left > 0 && left < 1 + kMinProcedureLines) {
      // Too little for another procedure: grow this one or leave trailing lines after it.
      if (m_rng.chance(50)) {
        lines += int(left);
      } else {
        trailing = int(left);
      }
    }
    for (int i = 0; i < gap; ++i)
      m_code.blank();
    writeProcedure(plan, lines);
    if (plan.name == "Main") m_wroteMain = true;
    remaining -= gap + lines;
    if (trailing > 0) {
      writeTrailingLines(trailing);
      remaining -= trailing;
    }
  }
}

// ---------------------------------------------------------------------------------------------------------
// Files.

struct Component {
  ComponentKind kind;
  QByteArray name;
  QString fileName;
};

void writeModuleHeader(QByteArray& out, const Component& component) {
  headerLine(out, "Attribute VB_Name = \"" + component.name + "\"");
}

void writeClassHeader(QByteArray& out, const Component& component) {
  headerLine(out, "VERSION 1.0 CLASS");
  headerLine(out, "BEGIN");
  headerLine(out, "  MultiUse = -1  'True");
  headerLine(out, "  Persistable = 0  'NotPersistable");
  headerLine(out, "  DataBindingBehavior = 0  'vbNone");
  headerLine(out, "  DataSourceBehavior  = 0  'vbNone");
  headerLine(out, "  MTSTransactionMode  = 0  'NotAnMTSObject");
  headerLine(out, "END");
  headerLine(out, "Attribute VB_Name = \"" + component.name + "\"");
  headerLine(out, "Attribute VB_GlobalNameSpace = False");
  headerLine(out, "Attribute VB_Creatable = True");
  headerLine(out, "Attribute VB_PredeclaredId = False");
  headerLine(out, "Attribute VB_Exposed = False");
}

// A small dialog: a label, a text box, a list, a frame holding a check box, and three command buttons
// that form a control array. The generated code refers to exactly these controls.
void writeFormHeader(QByteArray& out, const Component& component, Random& rng) {
  const Vocabulary& words = vocabulary();
  const int height = 3600 + 120 * rng.between(0, 10);
  const int width = 6000 + 120 * rng.between(0, 10);
  headerLine(out, "VERSION 5.00");
  formBegin(out, 0, "VB.Form", component.name);
  formProperty(out, 1, "Caption", quoted(words.strings[rng.next() % words.strings.size()]));
  formProperty(out, 1, "ClientHeight", height);
  formProperty(out, 1, "ClientLeft", 60);
  formProperty(out, 1, "ClientTop", 345);
  formProperty(out, 1, "ClientWidth", width);
  formProperty(out, 1, "LinkTopic", "\"Form1\"");
  formProperty(out, 1, "ScaleHeight", height);
  formProperty(out, 1, "ScaleWidth", width);
  formProperty(out, 1, "StartUpPosition", "3  'Windows Default");

  const std::array<const QByteArray*, 3> captions = {&words.save, &words.cancel, &words.remove};
  for (int index = 2; index >= 0; --index) {
    formBegin(out, 1, "VB.CommandButton", "cmdAcao");
    if (index == 1) formProperty(out, 2, "Cancel", "-1  'True");
    formProperty(out, 2, "Caption", quoted(*captions[index]));
    if (index == 0) formProperty(out, 2, "Default", "-1  'True");
    formProperty(out, 2, "Height", 375);
    formProperty(out, 2, "Index", index);
    formProperty(out, 2, "Left", width - 1335 * (3 - index));
    formProperty(out, 2, "TabIndex", 5 + index);
    formProperty(out, 2, "Top", height - 495);
    formProperty(out, 2, "Width", 1215);
    formEnd(out, 1);
  }
  formBegin(out, 1, "VB.Frame", "fraOpcoes");
  formProperty(out, 2, "Caption", quoted(words.options));
  formProperty(out, 2, "Height", 735);
  formProperty(out, 2, "Left", 120);
  formProperty(out, 2, "TabIndex", 3);
  formProperty(out, 2, "Top", height - 1335);
  formProperty(out, 2, "Width", 2895);
  formBegin(out, 2, "VB.CheckBox", "chkAtivo");
  formProperty(out, 3, "Caption", quoted(words.active));
  formProperty(out, 3, "Height", 255);
  formProperty(out, 3, "Left", 240);
  formProperty(out, 3, "TabIndex", 4);
  formProperty(out, 3, "Top", 300);
  formProperty(out, 3, "Value", "1  'Checked");
  formProperty(out, 3, "Width", 2415);
  formEnd(out, 2);
  formEnd(out, 1);
  formBegin(out, 1, "VB.ListBox", "lstItens");
  formProperty(out, 2, "Height", height - 2160);
  formProperty(out, 2, "Left", 120);
  formProperty(out, 2, "TabIndex", 2);
  formProperty(out, 2, "Top", 720);
  formProperty(out, 2, "Width", width - 240);
  formEnd(out, 1);
  formBegin(out, 1, "VB.TextBox", "txtCampo");
  formProperty(out, 2, "Height", 315);
  formProperty(out, 2, "Left", 1440);
  formProperty(out, 2, "MaxLength", 60);
  formProperty(out, 2, "TabIndex", 1);
  formProperty(out, 2, "Top", 240);
  formProperty(out, 2, "Width", width - 1560);
  formEnd(out, 1);
  formBegin(out, 1, "VB.Label", "lblTitulo");
  formProperty(out, 2, "Alignment", "1  'Right Justify");
  formProperty(out, 2, "Caption", quoted(words.description));
  formProperty(out, 2, "Height", 255);
  formProperty(out, 2, "Left", 120);
  formProperty(out, 2, "TabIndex", 0);
  formProperty(out, 2, "Top", 285);
  formProperty(out, 2, "Width", 1215);
  formEnd(out, 1);
  headerLine(out, "End");
  headerLine(out, "Attribute VB_Name = \"" + component.name + "\"");
  headerLine(out, "Attribute VB_GlobalNameSpace = False");
  headerLine(out, "Attribute VB_Creatable = False");
  headerLine(out, "Attribute VB_PredeclaredId = True");
  headerLine(out, "Attribute VB_Exposed = False");
}

void writeFile(const QString& path, const QByteArray& bytes) {
  QFile file(path);
  if (!file.open(QIODevice::WriteOnly | QIODevice::Truncate)) {
    throw std::runtime_error(QString("Cannot write %1: %2").arg(path, file.errorString()).toStdString());
  }
  if (file.write(bytes) != bytes.size() || !file.flush()) {
    throw std::runtime_error(QString("Cannot write %1: %2").arg(path, file.errorString()).toStdString());
  }
  file.close();
}

void makeDirectory(const QString& path) {
  if (!QDir().mkpath(path)) throw std::runtime_error(QString("Cannot create %1").arg(path).toStdString());
}

QByteArray projectFile(const QByteArray& name, const std::vector<Component>& components,
                       const QByteArray& startup) {
  QByteArray out;
  headerLine(out, "Type=Exe");
  headerLine(out,
             "Reference=*\\G{00020430-0000-0000-C000-000000000046}#2.0#0#..\\..\\..\\Windows\\SysWOW64\\"
             "stdole2.tlb#OLE Automation");
  for (const Component& component : components) {
    const QByteArray file = component.fileName.toLatin1();
    switch (component.kind) {
      case ComponentKind::Module:
        headerLine(out, "Module=" + component.name + "; " + file);
        break;
      case ComponentKind::Class:
        headerLine(out, "Class=" + component.name + "; " + file);
        break;
      case ComponentKind::Form:
        headerLine(out, "Form=" + file);
        break;
    }
  }
  headerLine(out, "Startup=\"" + startup + "\"");
  headerLine(out, "HelpFile=\"\"");
  headerLine(out, "Title=\"" + name + "\"");
  headerLine(out, "ExeName32=\"" + name + ".exe\"");
  headerLine(out, "Command32=\"\"");
  headerLine(out, "Name=\"" + name + "\"");
  headerLine(out, "HelpContextID=\"0\"");
  headerLine(out, "CompatibleMode=\"0\"");
  headerLine(out, "MajorVer=1");
  headerLine(out, "MinorVer=0");
  headerLine(out, "RevisionVer=0");
  headerLine(out, "AutoIncrementVer=0");
  headerLine(out, "ServerSupportFiles=0");
  headerLine(out, "CondComp=\"DEPURACAO = 0\"");
  headerLine(out, "CompilationType=0");
  headerLine(out, "OptimizationType=0");
  headerLine(out, "FavorPentiumPro(tm)=0");
  headerLine(out, "CodeViewDebugInfo=0");
  headerLine(out, "NoAliasing=0");
  headerLine(out, "BoundsCheck=0");
  headerLine(out, "OverflowCheck=0");
  headerLine(out, "FlPointCheck=0");
  headerLine(out, "FDIVCheck=0");
  headerLine(out, "UnroundedFP=0");
  headerLine(out, "StartMode=0");
  headerLine(out, "Unattended=0");
  headerLine(out, "Retained=0");
  headerLine(out, "ThreadPerObject=0");
  headerLine(out, "MaxNumberOfThreads=1");
  return out;
}

// Shares the lines among the components: each gets at least one, and sizes vary by up to ten to one,
// with an occasional much larger component, as in real projects.
std::vector<qint64> shareLines(qint64 total, int components, Random& rng) {
  std::vector<qint64> shares(components, 1);
  if (total <= components) return shares;
  std::vector<qint64> weights(components);
  qint64 weightSum = 0;
  for (qint64& weight : weights) {
    weight = rng.chance(5) ? rng.between(250, 1000) : rng.between(25, 250);
    weightSum += weight;
  }
  const qint64 spare = total - components;
  qint64 given = 0;
  for (int i = 0; i < components; ++i) {
    // Split the multiplication so that very large totals cannot overflow.
    const qint64 extra = (spare / weightSum) * weights[i] + (spare % weightSum) * weights[i] / weightSum;
    shares[i] += extra;
    given += extra;
  }
  const int start = rng.between(0, components - 1);
  for (qint64 i = 0; given < spare; ++i, ++given)
    ++shares[(start + i) % components];
  return shares;
}

// About 60% standard modules, 25% classes and 15% forms; the first component is always a module, so
// every project has a place for Sub Main.
std::vector<ComponentKind> planKinds(int count, Random& rng) {
  const int forms = int(count * 15 / 100.0 + 0.5);
  const int classes = int(count * 25 / 100.0 + 0.5);
  std::vector<ComponentKind> kinds;
  kinds.reserve(count);
  for (int i = 0; i < count; ++i) {
    kinds.push_back(i < forms ? ComponentKind::Form
                              : (i < forms + classes ? ComponentKind::Class : ComponentKind::Module));
  }
  for (int i = count - 1; i > 0; --i)
    std::swap(kinds[i], kinds[rng.between(0, i)]);
  const auto module = std::find(kinds.begin(), kinds.end(), ComponentKind::Module);
  if (module != kinds.end()) std::iter_swap(kinds.begin(), module);
  return kinds;
}

}  // namespace

GeneratedGroup generateProjects(const QString& directory, const GeneratorOptions& options) {
  if (options.projects < 1) throw std::invalid_argument("projects must be at least 1");
  if (options.components < options.projects) {
    throw std::invalid_argument("components must be at least the number of projects");
  }
  if (options.codeLines < 0) throw std::invalid_argument("codeLines must not be negative");

  const QString root = QFileInfo(directory).absoluteFilePath();
  makeDirectory(root);

  Random planner(streamSeed(options.seed, 0));
  const std::vector<qint64> targets = shareLines(options.codeLines, options.components, planner);

  GeneratedGroup result;
  QByteArray bytes;
  int componentIndex = 0;
  for (int p = 0; p < options.projects; ++p) {
    const QByteArray projectName = "Projeto" + QByteArray::number(p + 1);
    const QString projectDir = root + '/' + QString::fromLatin1(projectName);
    makeDirectory(projectDir);

    const int count = options.components / options.projects + (p < options.components % options.projects);
    const std::vector<ComponentKind> kinds = planKinds(count, planner);
    std::vector<Component> components;
    QByteArray startup;
    for (int c = 0; c < count; ++c, ++componentIndex) {
      static constexpr std::array<const char*, 3> kPrefixes = {"mod", "cls", "frm"};
      static constexpr std::array<const char*, 3> kExtensions = {".bas", ".cls", ".frm"};
      const int kind = int(kinds[c]);
      Component component{kinds[c], QByteArray(kPrefixes[kind]) + planner.pick(kNouns) +
                                        QByteArray::number(componentIndex + 1).rightJustified(4, '0')};
      component.fileName = QString::fromLatin1(component.name) + kExtensions[kind];

      Random rng(streamSeed(options.seed, quint64(componentIndex) + 1));
      bytes.clear();
      bytes.reserve(qsizetype(std::min<qint64>(targets[componentIndex] * 40 + 4096, qint64(64) << 20)));
      switch (component.kind) {
        case ComponentKind::Module:
          writeModuleHeader(bytes, component);
          break;
        case ComponentKind::Class:
          writeClassHeader(bytes, component);
          break;
        case ComponentKind::Form:
          writeFormHeader(bytes, component, rng);
          break;
      }
      ComponentWriter writer(component.kind, componentIndex + 1, rng.next(), bytes);
      writer.writeCode(targets[componentIndex], c == 0);
      if (writer.wroteMain()) startup = "Sub Main";
      if (startup.isEmpty() && component.kind == ComponentKind::Form) startup = component.name;
      result.codeLines += writer.lines();
      writeFile(projectDir + '/' + component.fileName, bytes);
      components.push_back(component);
    }
    if (startup.isEmpty()) startup = "Sub Main";

    const QString projectPath = projectDir + '/' + QString::fromLatin1(projectName) + ".vbp";
    writeFile(projectPath, projectFile(projectName, components, startup));
    result.projectFiles.push_back(projectPath);
    result.components += count;
  }

  if (options.projects > 1) {
    QByteArray group;
    headerLine(group, "VBGROUP 5.0");
    for (int p = 0; p < options.projects; ++p) {
      const QByteArray name = "Projeto" + QByteArray::number(p + 1);
      headerLine(group, (p == 0 ? "StartupProject=" : "Project=") + name + '\\' + name + ".vbp");
    }
    result.groupFile = root + "/Grupo.vbg";
    writeFile(result.groupFile, group);
  }
  return result;
}

TemporaryGroup::TemporaryGroup(const GeneratorOptions& options) : m_dir(std::make_unique<QTemporaryDir>()) {
  if (!m_dir->isValid()) throw std::runtime_error("cannot create a temporary directory");
  m_group = generateProjects(m_dir->path(), options);
}

TemporaryGroup::~TemporaryGroup() = default;

}  // namespace gen
