VERSION 5.00
Begin VB.Form frmCliente 
   BorderStyle     =   3  'Fixed Dialog
   Caption         =   "Cadastro de cliente"
   ClientHeight    =   4440
   ClientLeft      =   45
   ClientTop       =   330
   ClientWidth     =   6495
   BeginProperty Font 
      Name            =   "Tahoma"
      Size            =   8.25
      Charset         =   0
      Weight          =   400
      Underline       =   0   'False
      Italic          =   0   'False
      Strikethrough   =   0   'False
   EndProperty
   KeyPreview      =   -1  'True
   LinkTopic       =   "Form1"
   MaxButton       =   0   'False
   MinButton       =   0   'False
   ScaleHeight     =   4440
   ScaleWidth      =   6495
   ShowInTaskbar   =   0   'False
   StartUpPosition =   1  'CenterOwner
   Begin VB.CommandButton cmdAcao 
      Caption         =   "E&xcluir"
      Height          =   375
      Index           =   2
      Left            =   120
      TabIndex        =   16
      Top             =   3900
      Width           =   1215
   End
   Begin VB.CommandButton cmdAcao 
      Cancel          =   -1  'True
      Caption         =   "&Cancelar"
      Height          =   375
      Index           =   1
      Left            =   5160
      TabIndex        =   15
      Top             =   3900
      Width           =   1215
   End
   Begin VB.CommandButton cmdAcao 
      Caption         =   "&Gravar"
      Default         =   -1  'True
      Height          =   375
      Index           =   0
      Left            =   3840
      TabIndex        =   14
      Top             =   3900
      Width           =   1215
   End
   Begin VB.CheckBox chkAtivo 
      Caption         =   "Cliente &ativo"
      Height          =   255
      Left            =   3960
      TabIndex        =   13
      Top             =   3000
      Value           =   1  'Checked
      Width           =   2295
   End
   Begin VB.Frame fraTipo 
      Caption         =   "Tipo de pessoa"
      Height          =   855
      Left            =   120
      TabIndex        =   10
      Top             =   2760
      Width           =   3615
      Begin VB.OptionButton optTipo 
         Caption         =   "&Jurídica (CNPJ)"
         Height          =   255
         Index           =   1
         Left            =   1800
         TabIndex        =   12
         Top             =   360
         Width           =   1695
      End
      Begin VB.OptionButton optTipo 
         Caption         =   "&Física (CPF)"
         Height          =   255
         Index           =   0
         Left            =   240
         TabIndex        =   11
         Top             =   360
         Value           =   -1  'True
         Width           =   1455
      End
   End
   Begin VB.ComboBox cboUF 
      Height          =   315
      Left            =   1560
      Style           =   2  'Dropdown List
      TabIndex        =   9
      Top             =   2160
      Width           =   855
   End
   Begin VB.TextBox txtEmail 
      Height          =   315
      Left            =   1560
      MaxLength       =   80
      TabIndex        =   7
      Top             =   1680
      Width           =   4815
   End
   Begin VB.TextBox txtDocumento 
      Height          =   315
      Left            =   1560
      MaxLength       =   18
      TabIndex        =   5
      Top             =   1200
      Width           =   2295
   End
   Begin VB.TextBox txtNome 
      Height          =   315
      Left            =   1560
      MaxLength       =   60
      TabIndex        =   3
      Top             =   720
      Width           =   4815
   End
   Begin VB.TextBox txtCodigo 
      Alignment       =   1  'Right Justify
      BackColor       =   &H8000000F&
      Height          =   315
      Left            =   1560
      Locked          =   -1  'True
      TabIndex        =   1
      TabStop         =   0   'False
      Top             =   240
      Width           =   975
   End
   Begin VB.Label lblUF 
      Alignment       =   1  'Right Justify
      Caption         =   "&UF:"
      Height          =   255
      Left            =   120
      TabIndex        =   8
      Top             =   2220
      Width           =   1335
   End
   Begin VB.Label lblEmail 
      Alignment       =   1  'Right Justify
      Caption         =   "&E-mail:"
      Height          =   255
      Left            =   120
      TabIndex        =   6
      Top             =   1740
      Width           =   1335
   End
   Begin VB.Label lblDocumento 
      Alignment       =   1  'Right Justify
      Caption         =   "CP&F:"
      Height          =   255
      Left            =   120
      TabIndex        =   4
      Top             =   1260
      Width           =   1335
   End
   Begin VB.Label lblNome 
      Alignment       =   1  'Right Justify
      Caption         =   "&Nome:"
      Height          =   255
      Left            =   120
      TabIndex        =   2
      Top             =   780
      Width           =   1335
   End
   Begin VB.Label lblCodigo 
      Alignment       =   1  'Right Justify
      Caption         =   "Código:"
      Height          =   255
      Left            =   120
      TabIndex        =   0
      Top             =   300
      Width           =   1335
   End
End
Attribute VB_Name = "frmCliente"
Attribute VB_GlobalNameSpace = False
Attribute VB_Creatable = False
Attribute VB_PredeclaredId = True
Attribute VB_Exposed = False
Option Explicit

' Cadastro de um cliente. Use Editar: a janela é modal e devolve True quando
' o usuário grava.

Private mCliente As clsCliente
Private mNovo As Boolean
Private mGravou As Boolean

Public Function Editar(ByVal Cliente As clsCliente, ByVal Novo As Boolean) As Boolean
    Set mCliente = Cliente
    mNovo = Novo
    mGravou = False

    Load Me
    MostrarCliente
    Me.Show vbModal

    Editar = mGravou
    Set mCliente = Nothing
End Function

Private Sub Form_Load()
    Dim vSigla As Variant

    cboUF.Clear
    For Each vSigla In Split(SIGLAS_UF, " ")
        cboUF.AddItem vSigla
    Next
End Sub

Private Sub Form_KeyDown(KeyCode As Integer, Shift As Integer)
    ' F2 grava sem precisar do mouse
    If KeyCode = vbKeyF2 And Shift = 0 Then
        KeyCode = 0
        cmdAcao_Click acGravar
    End If
End Sub

Private Sub MostrarCliente()
    Dim i As Integer

    If mNovo Then
        Me.Caption = "Novo cliente"
        txtCodigo.Text = "(novo)"
    Else
        Me.Caption = "Cliente " & mCliente.Codigo & " - " & mCliente.Nome
        txtCodigo.Text = CStr(mCliente.Codigo)
    End If

    txtNome.Text = mCliente.Nome
    txtDocumento.Text = mCliente.DocumentoFormatado
    txtEmail.Text = mCliente.Email
    optTipo(mCliente.Tipo).Value = True
    chkAtivo.Value = IIf(mCliente.Ativo, vbChecked, vbUnchecked)

    cboUF.ListIndex = -1
    For i = 0 To cboUF.ListCount - 1
        If cboUF.List(i) = mCliente.UF Then
            cboUF.ListIndex = i
            Exit For
        End If
    Next i

    cmdAcao(acExcluir).Enabled = Not mNovo
End Sub

' Os três botões formam um array de controles; o índice diz qual foi clicado
Private Sub cmdAcao_Click(Index As Integer)
    Select Case Index
        Case acGravar
            If Gravar() Then
                mGravou = True
                Me.Hide
            End If

        Case acCancelar
            Me.Hide

        Case acExcluir
            If MsgBox(MSG_CONFIRMA_EXCLUSAO, vbQuestion + vbYesNo + vbDefaultButton2, Me.Caption) = vbYes Then
                gClientes.Remove mCliente.Codigo
                mGravou = True
                Me.Hide
            End If
    End Select
End Sub

Private Function Gravar() As Boolean
    Dim sMensagem As String
    Dim oCopia As clsCliente

    On Error GoTo Erro

    ' valida numa cópia para não estragar o cliente se algo estiver errado
    Set oCopia = New clsCliente
    With oCopia
        .Nome = txtNome.Text
        .Tipo = IIf(optTipo(tpJuridica).Value, tpJuridica, tpFisica)
        .Documento = txtDocumento.Text
        .Email = txtEmail.Text
        If cboUF.ListIndex >= 0 Then .UF = cboUF.Text
        .Ativo = (chkAtivo.Value = vbChecked)
    End With

    If Not oCopia.Validar(sMensagem) Then
        MsgBox sMensagem, vbExclamation, Me.Caption
        Exit Function
    End If

    With mCliente
        .Nome = oCopia.Nome
        .Tipo = oCopia.Tipo
        .Documento = oCopia.Documento
        .Email = oCopia.Email
        .UF = oCopia.UF
        .Ativo = oCopia.Ativo
    End With
    Gravar = True
    Exit Function

Erro:
    MostrarErro "frmCliente.Gravar"
End Function

Private Sub optTipo_Click(Index As Integer)
    If Index = tpJuridica Then
        lblDocumento.Caption = "CN&PJ:"
    Else
        lblDocumento.Caption = "CP&F:"
    End If
End Sub

Private Sub txtDocumento_LostFocus()
    Dim sDigitos As String

    sDigitos = gTexto.SomenteDigitos(txtDocumento.Text)
    Select Case Len(sDigitos)
        Case 11: txtDocumento.Text = gTexto.FormatarCPF(sDigitos)
        Case 14: txtDocumento.Text = gTexto.FormatarCNPJ(sDigitos)
    End Select
End Sub

Private Sub txtNome_LostFocus()
    txtNome.Text = gTexto.Capitalizar(txtNome.Text)
End Sub
