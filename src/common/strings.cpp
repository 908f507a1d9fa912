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

    // Keyboard macros and copy buffers: their windows and messages.
    {5000, u"Memórias de Cópia"},
    {5001, u"&Teclas (Colar):"},
    {5002, u"Conteúdo da &memória selecionada:"},
    {5037, u"Definições de Macros"},
    {5038, u"Palavras &Reservadas"},
    {5039, u"&Atalhos:"},
    {5040, u"&Texto a ser colado:"},
    {5086, u"Deseja salvar as alterações feitas nas macros?"},
    {5090, u"Deseja salvar as alterações feitas nas memórias de cópia?"},
    {5091, u"Erro indeterminado."},
    {5150, u"Ajuda em \"Palavras Reservadas\""},
    {5152, u"Erro na carga do formulário de macros."},
    {5158, u"Tópico não localizado no arquivo de ajuda."},
    {5163, u"Erro na carga do formulário das memórias de cópia."},
    // Task list and favourites.
    {5057, u"&Nome da Tarefa:"},
    {5058, u"&Descrição:"},
    {5059, u"&Cancelar"},
    {5060, u"Nova Tarefa"},
    {5061, u"Favoritos"},
    {5062, u"Procedimento"},
    {5063, u"Linha"},
    {5079, u"Tarefas a realizar (tique as já realizadas)"},
    {5080, u"&Adicionar ..."},
    {5081, u"&Remover"},
    {5082, u"&Editar ..."},
    {5083, u"&Fechar"},
    {5084, u"Erro na adição de item à lista de favoritos."},
    {5087, u"Deseja salvar estas mudanças?"},
    {5088, u"Nome de tarefa não pode ser nulo."},
    {5089, u"Erro indeterminado na exclusão de tarefa."},
    {5114, u"Não foi possível exibir este item dos favoritos."},
    {5115, u"Ele pode não mais existir no projeto."},
    {5116, u"Erro na obtenção de informações sobre os favoritos."},
    {5151, u"Tarefas"},
    {5154, u"Editar Tarefa"},
    {5162, u"Módulo"},
    // Extended find.
    {5003, u"Localizar Estendido"},
    {5004, u"Localizar em:"},
    {5005, u"Localizar texto:"},
    {5006, u"&Tudo"},
    {5007, u"&Projeto Ativo"},
    {5008, u"&Módulo Ativo"},
    {5009, u"Pala&vras Inteiras"},
    {5010, u"Dife&renciar maiúsculas de minúsculas"},
    {5011, u"Usar caracteres cur&inga"},
    {5012, u"Parar Pe&squisa"},
    {5013, u"&Localizar"},
    {5014, u"&Fechar"},
    {5015, u"Resultados:"},
    {5064, u"Projeto"},
    {5065, u"Módulo"},
    {5066, u"Procedimento"},
    {5067, u"Texto Localizado"},
    {5110, u"Erro na localização de texto."},
    {5111, u"O item seleciondado pertence a um projeto não localizado."},
    {5112, u"Não foi possível abrir a janela de código de"},
    {5113, u"no projeto ativo."},
    {5131, u"Pesquisando ..."},
    {5132, u"Resultados da pesquisa em"},
    {5133, u"Pesquisa completada ..."},
    {5134, u"linhas localizadas"},
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
