Attribute VB_Name = "modPersistencia"
Option Explicit

Private Declare Function GetPrivateProfileString Lib "kernel32" Alias "GetPrivateProfileStringA" _
    (ByVal lpApplicationName As String, ByVal lpKeyName As Any, ByVal lpDefault As String, ByVal lpReturnedString As String, ByVal nSize As Long, ByVal lpFileName As String) As Long
Private Declare Function WritePrivateProfileString Lib "kernel32" Alias "WritePrivateProfileStringA" (ByVal lpApplicationName As String, ByVal lpKeyName As Any, ByVal lpString As Any, ByVal lpFileName As String) As Long

Private Const SECAO_GERAL As String = "Geral"

' --------------------------------------------------------------------------
' Leitura e gravação dos dados da loja em arquivos de texto.
' Formato: um registro por linha, campos separados por ";".
' Linhas que começam com "#" são comentários e são ignoradas na leitura.
' --------------------------------------------------------------------------

' Lê um valor do arquivo de configuração (loja.ini)
Public Function LerConfiguracao(ByVal Chave As String, _
                                Optional ByVal Padrao As String = "") As String
    Dim sBuffer As String
    Dim lTam As Long

    sBuffer = String$(255, vbNullChar)
    lTam = GetPrivateProfileString(SECAO_GERAL, Chave, Padrao, sBuffer, Len(sBuffer), gPastaDados & ARQ_CONFIG)
    LerConfiguracao = Left$(sBuffer, lTam)
End Function

' Grava um valor no arquivo de configuração
Public Sub GravarConfiguracao(ByVal Chave As String, ByVal Valor As String)
    WritePrivateProfileString SECAO_GERAL, Chave, Valor, gPastaDados & ARQ_CONFIG
End Sub

' Carrega os clientes do arquivo. Devolve False se o arquivo existe mas não
' pôde ser lido; a ausência do arquivo (primeira execução) não é erro.
Public Function CarregarClientes(ByVal Arquivo As String, ByVal Clientes As clsClientes) As Boolean
    Dim iArq As Integer
    Dim sLinha As String
    Dim vCampos As Variant
    Dim oCliente As clsCliente
    Dim lLidos As Long

    On Error GoTo Erro

    If Len(Dir$(Arquivo)) = 0 Then
        CarregarClientes = True
        Exit Function
    End If

    iArq = FreeFile
    Open Arquivo For Input As #iArq
    Do While Not EOF(iArq)
        Line Input #iArq, sLinha
        sLinha = Trim$(sLinha)
        If Len(sLinha) = 0 Or Left$(sLinha, 1) = "#" Then
            ' linha vazia ou comentário: ignora
        Else
            vCampos = Split(sLinha, SEPARADOR)
            If UBound(vCampos) >= 5 Then
                Set oCliente = New clsCliente
                With oCliente
                    .Codigo = CLng(vCampos(0))
                    .Nome = vCampos(1)
                    .Documento = vCampos(2)
                    .Email = vCampos(3)
                    .UF = vCampos(4)
                    .Ativo = (vCampos(5) = "1")
                    If UBound(vCampos) >= 6 Then .Tipo = CLng(vCampos(6))
                End With
                Clientes.Add oCliente
                lLidos = lLidos + 1
            End If
        End If
    Loop
    Close #iArq

    CarregarClientes = True
    Exit Function

Erro:
    MostrarErro "CarregarClientes", "Arquivo " & Arquivo & ", registro " & (lLidos + 1)
    If iArq <> 0 Then Close #iArq
    CarregarClientes = False
End Function

' Grava todos os clientes. As linhas numeradas deixam Erl dizer onde a
' gravação parou quando o disco está cheio ou o arquivo está bloqueado.
Public Function GravarClientes(ByVal Arquivo As String, ByVal Clientes As clsClientes) As Boolean
          Dim iArq As Integer
          Dim oCliente As clsCliente

10        On Error GoTo Erro

20        iArq = FreeFile
30        Open Arquivo For Output As #iArq
40        Print #iArq, "# Clientes da loja - formato " & CStr(VERSAO_ARQUIVO)
50        For Each oCliente In Clientes
60            With oCliente
70                Print #iArq, CStr(.Codigo) & SEPARADOR & .Nome & SEPARADOR & _
                               .Documento & SEPARADOR & .Email & SEPARADOR & _
                               .UF & SEPARADOR & IIf(.Ativo, "1", "0") & SEPARADOR & CStr(.Tipo)
80            End With
90        Next oCliente
100       Close #iArq

110       GravarClientes = True
120       Exit Function

Erro:
130       MostrarErro "GravarClientes (linha " & Erl & ")", Arquivo
140       If iArq <> 0 Then Close #iArq
End Function

' Grava os pedidos: uma linha "P" por pedido seguida de uma linha "I" por item
Public Function GravarPedidos(ByVal Arquivo As String, ByVal Pedidos As Collection) As Boolean
    Dim iArq As Integer
    Dim oPedido As clsPedido
    Dim oItem As clsItemPedido

    On Error GoTo Erro

    iArq = FreeFile
    Open Arquivo For Output As #iArq
    For Each oPedido In Pedidos
        Print #iArq, "P" & SEPARADOR & CStr(oPedido.Numero) & SEPARADOR & _
                     Format$(oPedido.Data, "yyyy-mm-dd hh:nn") & SEPARADOR & _
                     CStr(oPedido.Cliente.Codigo) & SEPARADOR & CStr(oPedido.Situacao)
        For Each oItem In oPedido.Itens
            Print #iArq, "I" & SEPARADOR & oItem.Produto & SEPARADOR & _
                         CStr(oItem.Quantidade) & SEPARADOR & Str$(oItem.PrecoUnitario)
        Next oItem
    Next oPedido
    Close #iArq
    GravarPedidos = True
    Exit Function

Erro:
    MostrarErro "GravarPedidos", Arquivo
    If iArq <> 0 Then Close #iArq
End Function

' Exporta um resumo dos pedidos em CSV para abrir na planilha.
' O separador é ";" porque a planilha em português usa a vírgula nos decimais.
Public Sub ExportarResumo(ByVal Arquivo As String)
    Dim iArq As Integer
    Dim oPedido As clsPedido
    Dim cTotalGeral As Currency
    Dim lQtd As Long

    On Error GoTo Erro

    iArq = FreeFile
    Open Arquivo For Output As #iArq
    Print #iArq, "Número;Data;Cliente;Situação;Total"
    For Each oPedido In gPedidos
        If oPedido.Situacao <> spCancelado Then
            Print #iArq, CStr(oPedido.Numero) & ";" & Format$(oPedido.Data, "dd/mm/yyyy") & ";" & _
                         """" & Replace(oPedido.Cliente.Nome, """", """""") & """;" & _
                         oPedido.DescricaoSituacao & ";" & Format$(oPedido.Total, "0.00")
            cTotalGeral = cTotalGeral + oPedido.Total
            lQtd = lQtd + 1
        End If
    Next
    Print #iArq, ";;;Total geral;" & Format$(cTotalGeral, "0.00")
    Close #iArq

    MsgBox lQtd & " pedido(s) exportado(s) para " & Arquivo & ".", vbInformation, TITULO_APLICACAO
    Exit Sub

Erro:
    MostrarErro "ExportarResumo", Arquivo
    If iArq <> 0 Then Close #iArq
End Sub
