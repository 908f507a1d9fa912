VERSION 5.00
Begin VB.Form frmPrincipal 
   Caption         =   "Loja - Gestão de Pedidos"
   ClientHeight    =   5430
   ClientLeft      =   165
   ClientTop       =   735
   ClientWidth     =   7800
   BeginProperty Font 
      Name            =   "Tahoma"
      Size            =   8.25
      Charset         =   0
      Weight          =   400
      Underline       =   0   'False
      Italic          =   0   'False
      Strikethrough   =   0   'False
   EndProperty
   LinkTopic       =   "Form1"
   ScaleHeight     =   5430
   ScaleWidth      =   7800
   StartUpPosition =   2  'CenterScreen
   Begin VB.CommandButton cmdNovoPedido 
      Caption         =   "Novo &pedido..."
      Height          =   375
      Left            =   6240
      TabIndex        =   5
      Top             =   1440
      Width           =   1455
   End
   Begin VB.CommandButton cmdEditar 
      Caption         =   "&Editar..."
      Height          =   375
      Left            =   6240
      TabIndex        =   4
      Top             =   960
      Width           =   1455
   End
   Begin VB.CommandButton cmdNovoCliente 
      Caption         =   "&Novo cliente..."
      Default         =   -1  'True
      Height          =   375
      Left            =   6240
      TabIndex        =   3
      Top             =   480
      Width           =   1455
   End
   Begin VB.TextBox txtPesquisa 
      Height          =   315
      Left            =   120
      TabIndex        =   1
      Top             =   480
      Width           =   5895
   End
   Begin VB.ListBox lstClientes 
      Height          =   4155
      IntegralHeight  =   0   'False
      Left            =   120
      TabIndex        =   2
      Top             =   960
      Width           =   5895
   End
   Begin VB.Label lblResumo 
      Caption         =   "Nenhum cliente cadastrado."
      Height          =   255
      Left            =   120
      TabIndex        =   6
      Top             =   5160
      Width           =   5895
   End
   Begin VB.Label lblPesquisa 
      AutoSize        =   -1  'True
      Caption         =   "&Pesquisar cliente:"
      Height          =   195
      Left            =   120
      TabIndex        =   0
      Top             =   240
      Width           =   1290
   End
   Begin VB.Menu mnuArquivo 
      Caption         =   "&Arquivo"
      Begin VB.Menu mnuArquivoNovoCliente 
         Caption         =   "Novo &cliente..."
         Shortcut        =   ^N
      End
      Begin VB.Menu mnuArquivoNovoPedido 
         Caption         =   "Novo &pedido..."
         Shortcut        =   ^P
      End
      Begin VB.Menu mnuArquivoSep1 
         Caption         =   "-"
      End
      Begin VB.Menu mnuArquivoExportar 
         Caption         =   "&Exportar resumo..."
      End
      Begin VB.Menu mnuArquivoSep2 
         Caption         =   "-"
      End
      Begin VB.Menu mnuArquivoSair 
         Caption         =   "&Sair"
      End
   End
   Begin VB.Menu mnuCadastros 
      Caption         =   "&Cadastros"
      Begin VB.Menu mnuCadastrosClientes 
         Caption         =   "&Clientes"
         Begin VB.Menu mnuCadastrosClientesAtivos 
            Caption         =   "Somente &ativos"
            Checked         =   -1  'True
         End
         Begin VB.Menu mnuCadastrosClientesTodos 
            Caption         =   "&Todos"
         End
      End
   End
   Begin VB.Menu mnuAjuda 
      Caption         =   "Aj&uda"
      Begin VB.Menu mnuAjudaSobre 
         Caption         =   "&Sobre a Loja..."
      End
   End
End
Attribute VB_Name = "frmPrincipal"
Attribute VB_GlobalNameSpace = False
Attribute VB_Creatable = False
Attribute VB_PredeclaredId = True
Attribute VB_Exposed = False
Option Explicit

' Janela principal: lista de clientes, pesquisa e acesso aos cadastros.

Private Declare Function ShellExecute Lib "shell32.dll" Alias "ShellExecuteA" (ByVal hwnd As Long, ByVal lpOperation As String, ByVal lpFile As String, ByVal lpParameters As String, ByVal lpDirectory As String, ByVal nShowCmd As Long) As Long

Private Const SW_SHOWNORMAL As Long = 1

' Quando verdadeiro, a lista mostra também os clientes inativos
Private mMostrarInativos As Boolean

Private Sub Form_Load()
    Me.Caption = TITULO_APLICACAO & " - versão " & App.Major & "." & App.Minor
    mMostrarInativos = (LerConfiguracao("MostrarInativos", "0") = "1")
    mnuCadastrosClientesAtivos.Checked = Not mMostrarInativos
    mnuCadastrosClientesTodos.Checked = mMostrarInativos
    AtualizarLista
End Sub

Private Sub Form_Resize()
    ' a janela minimizada tem tamanho zero: nada a ajustar
    If Me.WindowState = vbMinimized Then Exit Sub
    If Me.ScaleWidth < 3000 Or Me.ScaleHeight < 2000 Then Exit Sub

    cmdNovoCliente.Left = Me.ScaleWidth - cmdNovoCliente.Width - 120
    cmdEditar.Left = cmdNovoCliente.Left
    cmdNovoPedido.Left = cmdNovoCliente.Left
    txtPesquisa.Width = cmdNovoCliente.Left - 240
    lstClientes.Width = txtPesquisa.Width
    lstClientes.Height = Me.ScaleHeight - lstClientes.Top - 360
    lblResumo.Top = lstClientes.Top + lstClientes.Height + 60
End Sub

Private Sub Form_QueryUnload(Cancel As Integer, UnloadMode As Integer)
    If UnloadMode = vbFormControlMenu Then
        If MsgBox("Deseja sair da Loja?", vbQuestion + vbYesNo, TITULO_APLICACAO) = vbNo Then
            Cancel = True
        End If
    End If
End Sub

Private Sub Form_Unload(Cancel As Integer)
    GravarConfiguracao "MostrarInativos", IIf(mMostrarInativos, "1", "0")
    If Not GravarClientes(gPastaDados & ARQ_CLIENTES, gClientes) Then
        If MsgBox("Os clientes não foram gravados. Sair mesmo assim?", _
                  vbExclamation + vbYesNo + vbDefaultButton2, TITULO_APLICACAO) = vbNo Then
            Cancel = True
            Exit Sub
        End If
    End If
    Encerrar
End Sub

' Preenche a lista; ItemData guarda o código do cliente de cada linha
Private Sub AtualizarLista()
    Dim oCliente As clsCliente
    Dim colLista As Collection
    Dim lAtivos As Long

    If Len(txtPesquisa.Text) > 0 Then
        Set colLista = gClientes.Pesquisar(txtPesquisa.Text)
    Else
        Set colLista = New Collection
        For Each oCliente In gClientes
            colLista.Add oCliente
        Next
    End If

    lstClientes.Clear
    For Each oCliente In colLista
        If oCliente.Ativo Or mMostrarInativos Then
            lstClientes.AddItem oCliente.Descricao
            lstClientes.ItemData(lstClientes.NewIndex) = oCliente.Codigo
        End If
        If oCliente.Ativo Then lAtivos = lAtivos + 1
    Next oCliente

    Select Case lstClientes.ListCount
        Case 0
            lblResumo.Caption = "Nenhum cliente encontrado."
        Case 1
            lblResumo.Caption = "1 cliente na lista."
        Case Else
            lblResumo.Caption = lstClientes.ListCount & " clientes na lista, " & _
                                lAtivos & " ativos."
    End Select
    cmdEditar.Enabled = (lstClientes.ListCount > 0)
End Sub

Private Function ClienteSelecionado() As clsCliente
    If lstClientes.ListIndex >= 0 Then
        Set ClienteSelecionado = gClientes.PorCodigo(lstClientes.ItemData(lstClientes.ListIndex))
    End If
End Function

Private Sub txtPesquisa_Change()
    AtualizarLista
End Sub

Private Sub lstClientes_DblClick()
    cmdEditar_Click
End Sub

Private Sub cmdNovoCliente_Click()
    Dim oCliente As clsCliente

    Set oCliente = New clsCliente
    If frmCliente.Editar(oCliente, True) Then
        gClientes.Add oCliente
        AtualizarLista
    End If
End Sub

Private Sub cmdEditar_Click()
    Dim oCliente As clsCliente

    Set oCliente = ClienteSelecionado()
    If oCliente Is Nothing Then
        MsgBox "Selecione um cliente na lista.", vbInformation, TITULO_APLICACAO
    ElseIf frmCliente.Editar(oCliente, False) Then
        AtualizarLista
    End If
End Sub

Private Sub cmdNovoPedido_Click()
    Dim frm As frmPedido

    Set frm = New frmPedido
    frm.NovoPedido ClienteSelecionado()
End Sub

Private Sub mnuArquivoNovoCliente_Click()
    cmdNovoCliente_Click
End Sub

Private Sub mnuArquivoNovoPedido_Click()
    cmdNovoPedido_Click
End Sub

Private Sub mnuArquivoExportar_Click()
    Dim sArquivo As String

    sArquivo = gPastaDados & "resumo_" & Format$(Date, "yyyymmdd") & ".csv"
    ExportarResumo sArquivo
    If MsgBox("Abrir o arquivo agora?", vbQuestion + vbYesNo, TITULO_APLICACAO) = vbYes Then
        ShellExecute Me.hwnd, "open", sArquivo, vbNullString, gPastaDados, SW_SHOWNORMAL
    End If
End Sub

Private Sub mnuArquivoSair_Click()
    Unload Me
End Sub

Private Sub mnuCadastrosClientesAtivos_Click()
    mMostrarInativos = False
    mnuCadastrosClientesAtivos.Checked = True
    mnuCadastrosClientesTodos.Checked = False
    AtualizarLista
End Sub

Private Sub mnuCadastrosClientesTodos_Click()
    mMostrarInativos = True
    mnuCadastrosClientesAtivos.Checked = False
    mnuCadastrosClientesTodos.Checked = True
    AtualizarLista
End Sub

Private Sub mnuAjudaSobre_Click()
    MsgBox TITULO_APLICACAO & vbCrLf & _
           "Versão " & App.Major & "." & App.Minor & "." & App.Revision & vbCrLf & _
           App.LegalCopyright & vbCrLf & vbCrLf & _
           "Hoje é " & gDatas.DataPorExtenso(Date) & ".", _
           vbInformation, "Sobre"
End Sub
