Attribute VB_Name = "modApi"
Option Explicit

' Chamadas à API do Windows usadas pela biblioteca.

Public Declare Function GetUserName Lib "advapi32.dll" Alias "GetUserNameA" (ByVal lpBuffer As String, nSize As Long) As Long
Public Declare Function GetComputerName Lib "kernel32" Alias "GetComputerNameA" (ByVal lpBuffer As String, nSize As Long) As Long
Private Declare Sub OutputDebugString Lib "kernel32" Alias "OutputDebugStringA" (ByVal lpOutputString As String)

Private Const TAMANHO_NOME As Long = 256

' Texto de um buffer da API, até o primeiro caractere nulo
Public Function TextoAteNulo(ByVal Buffer As String) As String
    Dim lPos As Long

    lPos = InStr(Buffer, vbNullChar)
    If lPos > 0 Then
        TextoAteNulo = Left$(Buffer, lPos - 1)
    Else
        TextoAteNulo = Buffer
    End If
End Function

Public Function NomeDoUsuario() As String
    Dim sBuffer As String
    Dim lTam As Long

    sBuffer = String$(TAMANHO_NOME, vbNullChar)
    lTam = TAMANHO_NOME
    If GetUserName(sBuffer, lTam) <> 0 Then NomeDoUsuario = TextoAteNulo(sBuffer)
End Function

Public Function NomeDoComputador() As String
    Dim sBuffer As String
    Dim lTam As Long

    sBuffer = String$(TAMANHO_NOME, vbNullChar)
    lTam = TAMANHO_NOME
    If GetComputerName(sBuffer, lTam) <> 0 Then NomeDoComputador = Left$(sBuffer, lTam)
End Function

' Mensagem para o depurador do sistema (DebugView), útil no componente
' compilado, onde Debug.Print não faz nada
Public Sub RegistrarDepuracao(ByVal Mensagem As String)
    OutputDebugString "[Utilitarios] " & Format$(Now, "hh:nn:ss") & " " & Mensagem & vbCrLf
End Sub

' --------------------------------------------------------------------------
' Histórico
'   2.0 - rotinas de datas separadas em clsDatas
'   2.1 - RegistrarDepuracao e NomeDoComputador
' --------------------------------------------------------------------------
