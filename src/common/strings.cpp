// SPDX-License-Identifier: MIT
// Texts are Brazilian Portuguese and must stay exactly as they are: users and documentation know them.
#include "common/strings.h"

#include <QHash>

namespace common {
namespace {

struct Entry {
  int id;
  const char16_t* text;
};

// clang-format off
constexpr Entry kStrings[] = {
    // Commands (menu items, toolbar tooltips).
    {1, u"Voltar"},
    {2, u"Avançar"},
    {3, u"Favoritos"},
    {4, u"Definir Macros de Teclado"},
    {5, u"Memórias Adicionais Para Cópias"},
    {6, u"Numerar Linhas"},
    {7, u"Indentar Código"},
    {8, u"Fechar Janelas"},
    {9, u"Localizar Estendido"},
    {10, u"Lista de Tarefas"},
    {11, u"Novo Procedimento"},
    {12, u"Opções"},
    {14, u"Ajuda"},
    {20, u"Adicionar aos Favoritos"},
    {201, u"Não há menu de Add-Ins."},

    // Indentation dialog.
    {5016, u"In&dentar"},
    {5017, u"&Usar"},
    {5018, u"&Projeto"},
    {5019, u"&Módulo"},
    {5020, u"Pr&ocedimento"},
    {5021, u"&Tabs"},
    {5022, u"E&spaços"},
    {5024, u"&Cancelar"},
    {5025, u"&Fechar"},
    {5026, u"&Indentar"},

    // Line numbering dialog.
    {5027, u"A&dicionar ou remover números de linha para:"},
    {5028, u"&Projeto"},
    {5029, u"&Módulo"},
    {5030, u"Pr&ocedimento"},
    {5031, u"&Número Inicial:"},
    {5032, u"Inter&valo:"},
    {5033, u"&Adicionar"},
    {5034, u"&Remover"},
    {5035, u"&Cancelar"},
    {5036, u"Numerar Linhas"},
    {5119, u"Erro: valor não numérico informado para o número inicial."},
    {5120, u"Erro: valor não numérico informado para o intervalo."},
    {5121, u"Erro na numeração de linhas."},
    {5122, u"Erro na numeração de linhas de módulo."},
    {5123, u"Erro na numeração de linhas de procedimento."},
    {5124, u"Informação inválida para o número de espaços."},
    {5125, u"Informe o número de espaços a ser usado."},
    {5126, u"Erro na indentação de código."},
    {5127, u"Erro na carga do formulário do indentador."},
    {5128, u"Erro na indentação de procedimento."},
    {5129, u"Erro na indentação de módulo."},
    {5130, u"Erro na indentação do projeto."},
    {5135, u"Indentar Código"},
    {5161, u"&Fechar"},

    // New-procedure wizard.
    {5041, u"&Novo &Procedimento"},
    {5042, u"Tratamento de &Erros"},
    {5043, u"Cabeçalho de Docu&mentação"},
    {5044, u"&Nome:"},
    {5045, u"Tipo de Procedimento"},
    {5046, u"Escopo"},
    {5047, u"Propriedades"},
    {5048, u"Variável Membro:"},
    {5049, u"Tipo de Dado:"},
    {5050, u"É Objeto"},
    {5051, u"Tratar Erro"},
    {5052, u"Documentar"},
    {5053, u"&Cancelar"},
    {5054, u"&Ajuda"},
    {5055, u"Entre aqui com o código a ser inserido após o label \"ErrorHandler\":"},
    {5056, u"Entre aqui com o texto do cabeçalho de documentação:"},
    {5098, u"O procedimento foi criado."},
    {5099, u"Deseja criar mais algum?"},
    {5100, u"Erro na criação do novo procedimento."},
    {5101, u"Tratar Erro"},
    {5102, u"foi selecionado, mas nenhum código de tratamento foi informado."},
    {5103, u"Cabeçalho Documentação"},
    {5104, u"foi selecionado, mas nenhum cabeçalho foi informado."},
    {5105, u"Erro: nome de procedimento inválido."},
    {5106, u"Erro: tipo de dado inválido."},
    {5107, u"Erro: nome de variável membro inválido."},
    {5108, u"Ao menos um procedimento de propriedade deve ser selecionado."},
    {5109, u"Propriedades do tipo Variant para objetos que não sejam apenas de leitura devem ter os procedimentos Let e Set."},
    {5117, u"Erro: nome de procedimento já usado neste módulo."},
    {5118, u"Erro: nome de variável membro já usado neste módulo."},
    {5136, u"Novo Procedimento"},
    {5137, u"Tipo Retornado:"},

    // Text insertion: its failure, and the placeholders as the macro editor names them.
    {5096, u"Erro na inserção de código."},
    {5138, u"Nome do Projeto {ProjectName}"},
    {5139, u"Nome do Módulo {ModuleName}"},
    {5140, u"Nome do Procedimento {ProcedureName}"},
    {5141, u"Tipo de Procedimento {ProcedureType}"},
    {5142, u"Nome do Controle {ControlName}"},
    {5143, u"Nome do Computador {ComputerName}"},
    {5144, u"Nome do Usuário {UserName}"},
    {5145, u"Início de Seleção {SS}"},
    {5146, u"Fim de Seleção {SE}"},
    {5147, u"Posição do Cursor {C}"},
    {5148, u"Inserir Data {Date}"},
    {5149, u"Inserir Hora {Time}"},
};
// clang-format on

const QHash<int, QString>& table() {
  static const QHash<int, QString> strings = [] {
    QHash<int, QString> map;
    for (const Entry& entry : kStrings)
      map.insert(entry.id, QString::fromUtf16(entry.text));
    return map;
  }();
  return strings;
}

}  // namespace

QString LoadResString(int id) {
  return table().value(id);
}

}  // namespace common
