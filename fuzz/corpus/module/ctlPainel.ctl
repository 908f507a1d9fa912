VERSION 5.00
Begin VB.UserControl ctlPainel 
   BackColor       =   &H00F4ECE2&
   ClientHeight    =   1560
   ClientLeft      =   0
   ClientTop       =   0
   ClientWidth     =   4440
   ControlContainer=   -1  'True
   ScaleHeight     =   1560
   ScaleWidth      =   4440
End
Attribute VB_Name = "ctlPainel"
Attribute VB_GlobalNameSpace = False
Attribute VB_Creatable = True
Attribute VB_PredeclaredId = False
Attribute VB_Exposed = False
' Um painel que agrupa controles, como as páginas de um assistente.
Option Explicit

Public Event Mudou()

Private mTitulo As String

Public Property Get Titulo() As String
    Titulo = mTitulo
End Property

Public Property Let Titulo(ByVal Valor As String)
    mTitulo = Valor
    PropertyChanged "Titulo"
    RaiseEvent Mudou
End Property

Private Sub UserControl_ReadProperties(PropBag As PropertyBag)
    mTitulo = PropBag.ReadProperty("Titulo", "")
End Sub

Private Sub UserControl_WriteProperties(PropBag As PropertyBag)
    PropBag.WriteProperty "Titulo", mTitulo, ""
End Sub
