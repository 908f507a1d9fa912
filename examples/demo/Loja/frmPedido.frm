VERSION 5.00
Begin VB.Form frmPedido 
   BorderStyle     =   1  'Fixed Single
   Caption         =   "Pedido"
   ClientHeight    =   5040
   ClientLeft      =   45
   ClientTop       =   330
   ClientWidth     =   7335
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
   MaxButton       =   0   'False
   ScaleHeight     =   5040
   ScaleWidth      =   7335
   StartUpPosition =   1  'CenterOwner
   Begin VB.CommandButton cmdFechar 
      Cancel          =   -1  'True
      Caption         =   "Fechar"
      Height          =   375
      Left            =   6000
      TabIndex        =   13
      Top             =   4560
      Width           =   1215
   End
   Begin VB.CommandButton cmdGravar 
      Caption         =   "&Gravar pedido"
      Height          =   375
      Left            =   4560
      TabIndex        =   12
      Top             =   4560
      Width           =   1335
   End
   Begin VB.CheckBox chkEntregar 
      Caption         =   "&Entregar no endereço do cliente"
      Height          =   255
      Left            =   120
      TabIndex        =   11
      Top             =   4080
      Width           =   3375
   End
   Begin VB.ListBox lstItens 
      Height          =   2400
      Left            =   120
      TabIndex        =   10
      Top             =   1560
      Width           =   7095
   End
   Begin VB.CommandButton cmdAdicionar 
      Caption         =   "&Adicionar"
      Default         =   -1  'True
      Height          =   315
      Left            =   6000
      TabIndex        =   9
      Top             =   1080
      Width           =   1215
   End
   Begin VB.TextBox txtPreco 
      Alignment       =   1  'Right Justify
      Height          =   315
      Left            =   4680
      TabIndex        =   8
      Top             =   1080
      Width           =   1095
   End
   Begin VB.TextBox txtQuantidade 
      Alignment       =   1  'Right Justify
      Height          =   315
      Left            =   3720
      MaxLength       =   4
      TabIndex        =   6
      Text            =   "1"
      Top             =   1080
      Width           =   735
   End
   Begin VB.TextBox txtProduto 
      Height          =   315
      Left            =   120
      MaxLength       =   40
      TabIndex        =   4
      Top             =   1080
      Width           =   3375
   End
   Begin VB.ComboBox cboCliente 
      Height          =   315
      Left            =   1080
      Style           =   2  'Dropdown List
      TabIndex        =   1
      Top             =   240
      Width           =   6135
   End
   Begin VB.Label lblTotal 
      Alignment       =   1  'Right Justify
      BorderStyle     =   1  'Fixed Single
      Caption         =   "R$ 0,00"
      BeginProperty Font 
         Name            =   "Tahoma"
         Size            =   9.75
         Charset         =   0
         Weight          =   700
         Underline       =   0   'False
         Italic          =   0   'False
         Strikethrough   =   0   'False
      EndProperty
      Height          =   345
      Left            =   5400
      TabIndex        =   15
      Top             =   4020
      Width           =   1815
   End
   Begin VB.Label lblTotalTitulo 
      Alignment       =   1  'Right Justify
      Caption         =   "Total:"
      Height          =   255
      Left            =   4560
      TabIndex        =   14
      Top             =   4080
      Width           =   735
   End
   Begin VB.Label lblPreco 
      Caption         =   "P&reço unitário:"
      Height          =   255
      Left            =   4680
      TabIndex        =   7
      Top             =   840
      Width           =   1215
   End
   Begin VB.Label lblQuantidade 
      Caption         =   "&Qtde.:"
      Height          =   255
      Left            =   3720
      TabIndex        =   5
      Top             =   840
      Width           =   735
   End
   Begin VB.Label lblProduto 
      Caption         =   "&Produto:"
      Height          =   255
      Left            =   120
      TabIndex        =   3
      Top             =   840
      Width           =   1215
   End
   Begin VB.Label lblCliente 
      Caption         =   "&Cliente:"
      Height          =   255
      Left            =   120
      TabIndex        =   0
      Top             =   300
      Width           =   855
   End
   Begin VB.Label lblSituacao 
      Caption         =   "Pedido aberto"
      ForeColor       =   &H00800000&
      Height          =   255
      Left            =   120
      TabIndex        =   2
      Top             =   600
      Width           =   3495
   End
End
Attribute VB_Name = "frmPedido"
Attribute VB_GlobalNameSpace = False
Attribute VB_Creatable = False
Attribute VB_PredeclaredId = True
Attribute VB_Exposed = False
Option Explicit

' Digitação de um pedido. Cada instância da janela edita um pedido; a janela
' acompanha o total pelo evento TotalAlterado da classe clsPedido.

Private WithEvents mPedido As clsPedido
Attribute mPedido.VB_VarHelpID = -1

' Abre a janela com um pedido novo, já com o cliente escolhido, se houver
Public Sub NovoPedido(Optional ByVal Cliente As clsCliente = Nothing)
    Dim oCliente As clsCliente

    Set mPedido = New clsPedido
    mPedido.Numero = ProximoNumeroPedido()
    Me.Caption = "Pedido " & Format$(mPedido.Numero, "000000")

    cboCliente.Clear
    For Each oCliente In gClientes
        If oCliente.Ativo Then
            cboCliente.AddItem oCliente.Descricao
            cboCliente.ItemData(cboCliente.NewIndex) = oCliente.Codigo
            If Not Cliente Is Nothing Then
                If Cliente Is oCliente Then cboCliente.ListIndex = cboCliente.NewIndex
            End If
        End If
    Next

    Me.Show
End Sub

Private Sub cboCliente_Click()
    On Error GoTo Erro

    If cboCliente.ListIndex < 0 Then Exit Sub
    Set mPedido.Cliente = gClientes.PorCodigo(cboCliente.ItemData(cboCliente.ListIndex))
    Exit Sub

Erro:
    MostrarErro "frmPedido.cboCliente_Click"
    cboCliente.ListIndex = -1
End Sub

Private Sub cmdAdicionar_Click()
    Dim lQtd As Long
    Dim cPreco As Currency

    ' quantidade: número inteiro de 1 a 9999
    If Not IsNumeric(txtQuantidade.Text) Then
        MsgBox "Quantidade inválida.", vbExclamation, Me.Caption
        txtQuantidade.SetFocus
        Exit Sub
    End If
    lQtd = CLng(txtQuantidade.Text)

    If Len(Trim$(txtPreco.Text)) = 0 Then
        cPreco = -1     ' usa o preço de tabela
    ElseIf Not LerValor(txtPreco.Text, cPreco) Then
        MsgBox "Preço inválido.", vbExclamation, Me.Caption
        txtPreco.SetFocus
        Exit Sub
    End If

    On Error GoTo Erro
    mPedido.AdicionarItem txtProduto.Text, lQtd, cPreco
    AtualizarItens

    txtProduto.Text = ""
    txtPreco.Text = ""
    txtQuantidade.Text = "1"
    txtProduto.SetFocus
    Exit Sub

Erro:
    MostrarErro "frmPedido.cmdAdicionar_Click", "Produto: " & txtProduto.Text
End Sub

Private Sub AtualizarItens()
    Dim oItem As clsItemPedido

    lstItens.Clear
    For Each oItem In mPedido.Itens
        lstItens.AddItem oItem.Descricao
    Next
End Sub

' Tecla Delete remove o item selecionado
Private Sub lstItens_KeyDown(KeyCode As Integer, Shift As Integer)
    If KeyCode <> vbKeyDelete Or lstItens.ListIndex < 0 Then Exit Sub
    mPedido.RemoverItem lstItens.ListIndex + 1
    AtualizarItens
End Sub

Private Sub chkEntregar_Click()
    mPedido.Entregar = (chkEntregar.Value = vbChecked)
End Sub

Private Sub mPedido_TotalAlterado(ByVal NovoTotal As Currency)
    lblTotal.Caption = FormatarMoeda(NovoTotal)
#If DEPURACAO Then
    Debug.Print Me.Caption; ": total "; NovoTotal
#End If
End Sub

Private Sub cmdGravar_Click()
    On Error GoTo Erro

    If mPedido.Cliente Is Nothing Then
        MsgBox "Escolha o cliente do pedido.", vbExclamation, Me.Caption
        Exit Sub
    End If

    mPedido.Fechar
    gPedidos.Add mPedido, "P" & mPedido.Numero
    If GravarPedidos(gPastaDados & ARQ_PEDIDOS, gPedidos) Then
        MsgBox MSG_OPERACAO_CONCLUIDA, vbInformation, Me.Caption
        Unload Me
    End If
    Exit Sub

Erro:
    MostrarErro "frmPedido.cmdGravar_Click", "Pedido " & mPedido.Numero
End Sub

Private Sub cmdFechar_Click()
    Unload Me
End Sub

Private Sub Form_Unload(Cancel As Integer)
    Set mPedido = Nothing
End Sub
