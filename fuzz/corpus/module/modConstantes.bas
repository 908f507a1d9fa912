Attribute VB_Name = "modConstantes"
' ==========================================================================
' modConstantes
' Constantes, enumerações e tipos usados em todo o sistema da loja.
' Este módulo só tem declarações: nenhum procedimento.
' ==========================================================================
Option Explicit

' Versão do formato dos arquivos de dados gravados pela loja
Public Const VERSAO_ARQUIVO As Integer = 2

' Arquivos de dados (ficam na pasta do executável)
Public Const ARQ_CLIENTES As String = "clientes.txt"
Public Const ARQ_PEDIDOS As String = "pedidos.txt"
Public Const ARQ_CONFIG As String = "loja.ini"

' Separador de campos nos arquivos de texto
Public Const SEPARADOR As String = ";"

' Regras de negócio
Public Const DESCONTO_MAXIMO As Double = 0.15
Public Const LIMITE_ITENS_PEDIDO As Long = 99
Public Const VALOR_MINIMO_ENTREGA As Currency = 50

' Erros próprios da aplicação (somados a vbObjectError)
Public Const ERRO_CLIENTE_INATIVO As Long = 1001
Public Const ERRO_PEDIDO_FECHADO As Long = 1002
Public Const ERRO_LIMITE_ITENS As Long = 1003

' Títulos e mensagens padrão
Public Const TITULO_APLICACAO As String = "Loja - Gestão de Pedidos"
Public Const MSG_CONFIRMA_EXCLUSAO As String = "Confirma a exclusão do cliente?"
Public Const MSG_OPERACAO_CONCLUIDA As String = "Operação concluída com sucesso."

' Situação de um pedido
Public Enum SituacaoPedido
    spAberto = 0
    spFechado = 1
    spCancelado = 2
    spEntregue = 3
End Enum

' Tipo de pessoa: física (CPF) ou jurídica (CNPJ)
Public Enum TipoPessoa
    tpFisica = 0
    tpJuridica = 1
End Enum

' Índices do array de botões cmdAcao do cadastro de clientes
Public Enum AcaoCadastro
    acGravar = 0
    acCancelar = 1
    acExcluir = 2
End Enum

' Registro de tamanho fixo dos arquivos da versão 1 (importação)
Public Type RegistroCliente
    Codigo As Long
    Nome As String * 60
    Documento As String * 18
    UF As String * 2
    Ativo As Boolean
End Type

' Siglas das unidades da federação, na ordem em que aparecem nas listas
Public Const SIGLAS_UF As String = "AC AL AM AP BA CE DF ES GO MA MG MS MT PA PB PE PI PR RJ RN RO RR RS SC SE SP TO"
