VERSION 5.00
Begin VB.Form frmSobre 
   BorderStyle     =   3  'Fixed Dialog
   Caption         =   "Sobre a Loja"
   ClientHeight    =   4500
   ClientLeft      =   45
   ClientTop       =   330
   ClientWidth     =   6015
   BeginProperty Font 
      Name            =   "Tahoma"
      Size            =   8.25
      Charset         =   0
      Weight          =   400
      Underline       =   0   'False
      Italic          =   0   'False
      Strikethrough   =   0   'False
   EndProperty
   Icon            =   "frmSobre.frx":0000
   LinkTopic       =   "Form1"
   MaxButton       =   0   'False
   MinButton       =   0   'False
   ScaleHeight     =   4500
   ScaleWidth      =   6015
   ShowInTaskbar   =   0   'False
   StartUpPosition =   1  'CenterOwner
   Begin VB.CommandButton cmdSistema 
      Caption         =   "&Sistema..."
      Height          =   375
      Left            =   4680
      TabIndex        =   6
      Top             =   3480
      Width           =   1215
   End
   Begin VB.CommandButton cmdOk 
      Cancel          =   -1  'True
      Caption         =   "OK"
      Default         =   -1  'True
      Height          =   375
      Left            =   4680
      TabIndex        =   5
      Top             =   3000
      Width           =   1215
   End
   Begin Loja.ctlPainel ctlPainel1 
      Left            =   120
      TabIndex        =   2
      Top             =   2880
      _ExtentX        =   7832
      _ExtentY        =   2752
      Begin VB.CheckBox chkDicas 
         Appearance      =   0  'Flat
         BackColor       =   &H00F4ECE2&
         Caption         =   "Mostrar &dicas ao iniciar"
         ForeColor       =   &H80000008&
         Height          =   255
         Left            =   120
         TabIndex        =   4
         Top             =   960
         Value           =   1  'Checked
         Width           =   3015
      End
      Begin VB.ComboBox cboIdioma 
         Height          =   315
         ItemData        =   "frmSobre.frx":048A
         Left            =   120
         List            =   "frmSobre.frx":049A
         Style           =   2  'Dropdown List
         TabIndex        =   3
         Top             =   480
         Width           =   2295
      End
      Begin VB.Label lblIdioma 
         BackStyle       =   0  'Transparent
         Caption         =   "&Idioma das mensagens:"
         Height          =   255
         Left            =   120
         TabIndex        =   7
         Top             =   180
         Width           =   2295
      End
   End
   Begin VB.TextBox txtLicenca 
      Height          =   1335
      Left            =   120
      Locked          =   -1  'True
      MultiLine       =   -1  'True
      ScrollBars      =   2  'Vertical
      TabIndex        =   1
      Text            =   $"frmSobre.frx":04BB
      Top             =   1320
      Width           =   5775
   End
   Begin VB.Label lblVersao 
      Alignment       =   1  'Right Justify
      AutoSize        =   -1  'True
      Caption         =   "Versão 1.4.12"
      Height          =   195
      Left            =   4920
      TabIndex        =   8
      Top             =   840
      Width           =   975
   End
   Begin VB.Label lblTitulo 
      AutoSize        =   -1  'True
      Caption         =   "Loja - Gestão de Pedidos"
      BeginProperty Font 
         Name            =   "Tahoma"
         Size            =   12
         Charset         =   0
         Weight          =   700
         Underline       =   0   'False
         Italic          =   0   'False
         Strikethrough   =   0   'False
      EndProperty
      Height          =   285
      Left            =   1080
      TabIndex        =   0
      Top             =   240
      Width           =   3000
   End
   Begin VB.Image imgLogo 
      Height          =   720
      Left            =   120
      Picture         =   "frmSobre.frx":05D1
      Top             =   120
      Width           =   720
   End
End
Attribute VB_Name = "frmSobre"
Attribute VB_GlobalNameSpace = False
Attribute VB_Creatable = False
Attribute VB_PredeclaredId = True
Attribute VB_Exposed = False
' Janela "Sobre": o logotipo, a versão, o aviso de copyright e as preferências de idioma.
Option Explicit

Private Sub cboIdioma_Click()
    ctlPainel1.Tag = cboIdioma.ItemData(cboIdioma.ListIndex)
End Sub

Private Sub cmdOk_Click()
    Unload Me
End Sub

Private Sub cmdSistema_Click()
    MsgBox "Windows " & Environ$("OS"), vbInformation, Caption
End Sub

Private Sub Form_Load()
    lblVersao.Caption = "Versão " & App.Major & "." & App.Minor & "." & App.Revision
    cboIdioma.ListIndex = 0
End Sub
