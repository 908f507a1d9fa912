Attribute VB_Name = "modPrincipal"
Option Explicit

' Liga as mensagens de depuração na janela Imediata (0 desliga)
#Const DEPURACAO = 1

Public Declare Sub Sleep Lib "kernel32" (ByVal dwMilliseconds As Long)

' GetTickCount mudou de biblioteca entre as versões de 16 e 32 bits do Windows
#If Win32 Then
Private Declare Function GetTickCount Lib "kernel32" () As Long
#Else
Private Declare Function GetTickCount Lib "User" () As Long
#End If

' Objetos globais da aplicação
Public gClientes As clsClientes
Public gPedidos As Collection
Public gPastaDados As String
Public gTexto As Utilitarios.clsTexto
Public gDatas As Utilitarios.clsDatas

Private mInicio As Long

' --------------------------------------------------------------------------
' Ponto de entrada: prepara os objetos globais, carrega os dados e mostra
' a janela principal.
' --------------------------------------------------------------------------
Public Sub Main()
    mInicio = GetTickCount()

    If App.PrevInstance Then
        MsgBox "A Loja já está aberta neste computador.", vbInformation, TITULO_APLICACAO
        Exit Sub
    End If

    gPastaDados = App.Path
    If Right$(gPastaDados, 1) <> "\" Then gPastaDados = gPastaDados & "\"

    Set gClientes = New clsClientes
    Set gPedidos = New Collection
    Set gTexto = New Utilitarios.clsTexto
    Set gDatas = New Utilitarios.clsDatas

    If Not CarregarClientes(gPastaDados & ARQ_CLIENTES, gClientes) Then
        MsgBox "Não foi possível ler o arquivo de clientes." & vbCrLf & _
               "O sistema começará com o cadastro vazio.", _
               vbExclamation, TITULO_APLICACAO
    End If

#If DEPURACAO Then
    Debug.Print "Inicialização: "; GetTickCount() - mInicio; " ms, "; _
                gClientes.Count; " clientes"
#End If

    frmPrincipal.Show
End Sub

' Mostra uma mensagem de erro padronizada. Origem diz onde o erro ocorreu;
' deve ser chamada antes de qualquer outra instrução que limpe o objeto Err.
Public Sub MostrarErro(ByVal Origem As String, Optional ByVal Detalhe As String = "")
    Dim sMsg As String

    sMsg = "Ocorreu um erro em " & Origem & "." & vbCrLf & vbCrLf & _
           "Número: " & Err.Number & vbCrLf & _
           "Descrição: " & Err.Description
    If Len(Detalhe) > 0 Then sMsg = sMsg & vbCrLf & "Detalhe: " & Detalhe

#If DEPURACAO Then
    Debug.Print "ERRO em "; Origem; ": "; Err.Number; " "; Err.Description
#End If

    MsgBox sMsg, vbCritical, TITULO_APLICACAO
End Sub

' Espera alguns milissegundos sem travar a interface
Public Sub Aguardar(ByVal Milissegundos As Long)
    Dim lFim As Long

    lFim = GetTickCount() + Milissegundos
    Do While GetTickCount() < lFim
        DoEvents
        Sleep 10
    Loop
End Sub

' Fecha todas as janelas e libera os objetos globais
Public Sub Encerrar()
    Dim frm As Form

    For Each frm In Forms
        If Not frm Is frmPrincipal Then Unload frm
    Next frm

    Set gDatas = Nothing
    Set gTexto = Nothing
    Set gPedidos = Nothing
    Set gClientes = Nothing
End Sub

' Próximo número de pedido: o maior número já usado mais um
Public Function ProximoNumeroPedido() As Long
    Dim oPedido As clsPedido
    Dim lMaior As Long

    For Each oPedido In gPedidos
        If oPedido.Numero > lMaior Then lMaior = oPedido.Numero
    Next
    ProximoNumeroPedido = lMaior + 1
End Function

' Formata um valor em reais, por exemplo "R$ 1.234,56"
Public Function FormatarMoeda(ByVal Valor As Currency) As String
    FormatarMoeda = "R$ " & Format$(Valor, "#,##0.00")
End Function

' Converte o texto digitado pelo usuário em valor; aceita "1.234,56" e "1234.56".
' Devolve False (e deixa Valor em zero) quando o texto não é um número.
Public Function LerValor(ByVal Texto As String, ByRef Valor As Currency) As Boolean
    Dim sLimpo As String

    Valor = 0
    sLimpo = Replace(Trim$(Texto), "R$", "")
    sLimpo = Trim$(sLimpo)
    If Len(sLimpo) = 0 Then Exit Function

    If InStr(sLimpo, ",") > 0 Then
        ' formato brasileiro: o ponto separa milhares
        sLimpo = Replace(sLimpo, ".", "")
    ElseIf InStr(sLimpo, ".") > 0 Then
        sLimpo = Replace(sLimpo, ".", ",")
    Else
        ' número inteiro: nada a ajustar
    End If

    If IsNumeric(sLimpo) Then
        Valor = CCur(sLimpo)
        LerValor = True
    End If
End Function

' Observação: as rotinas de gravação e leitura de arquivos ficam em
' modPersistencia; as de texto e datas, na biblioteca Utilitarios.

