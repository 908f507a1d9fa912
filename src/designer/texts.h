// SPDX-License-Identifier: MIT
// The fixed texts of the options and property defaults dialogs (they have no number in the string table).
// Texts are Brazilian Portuguese and stay exactly as they are.
#pragma once

namespace designer {

// frmOptions
inline constexpr char16_t kOptionsCaption[] = u"Quimbel - Opções ";  // the trailing blank is the dialog's
inline constexpr char16_t kShowPropertiesLabel[] =
    u"Exibir janela de propriedades principais na adição de controles";
inline constexpr char16_t kNumIndentLabel[] = u"Numerar linhas sempre que indentar";
inline constexpr char16_t kLabelTranspLabel[] = u"Tornar transparentes os Labels adicionados";
inline constexpr char16_t kTextBox1Label[] = u"Limpar propriedade Text ao adicionar TextBox";
inline constexpr char16_t kFormPosLabel[] = u"Novos forms com StartUpPosition = 2 - Center Screen";
inline constexpr char16_t kBorderStyleLabel[] = u"Novos forms com BorderStyle = 1 - Fixed Single";
inline constexpr char16_t kSelTextBoxLabel[] = u"Selecionar texto de novos TextBoxes no ganho do foco";
inline constexpr char16_t kTextUcaseLabel[] = u"Tornar maiúsculas as letras digitadas em TextBoxes novos";
inline constexpr char16_t kControlRenamedLabel[] =
    u"Ao re-nomear controle, substituir ocorrências do nome antigo pelo nome novo no módulo de código do "
    u"formulário";
inline constexpr char16_t kOptionsColourLabel[] = u"BackColor de controles no ganho do foco:";
inline constexpr char16_t kOptionsColourNotNumeric[] =
    u"Erro: valor não numérico informado para a cor dos TextBoxes no ganho do foco.";

// frmProps
inline constexpr char16_t kPropsCaptionSuffix[] = u" - Propriedades";
inline constexpr char16_t kEnterTabLabel[] = u"Tratar tecla Enter como Tab";
inline constexpr char16_t kBackColorLabel[] = u"BackColor no ganho do foco:";
inline constexpr char16_t kPropsColourNotNumeric[] =
    u"Erro: valor não numérico informado para a cor do controle no ganho do foco.";
/// A typed value that is no value of the property's type: %1 the property, %2 the text.
inline constexpr char16_t kInvalidPropertyValue[] = u"Valor inválido para %1: \"%2\".";
/// A name (with its index, for an element of a control array) another control of the form has.
inline constexpr char16_t kControlNameInUse[] = u"Já existe neste formulário um controle chamado \"%1\".";
inline constexpr char16_t kInvalidControlName[] = u"Nome de controle inválido: \"%1\".";

// Both
inline constexpr char16_t kColourButton[] = u"...";
inline constexpr char16_t kOK[] = u"&OK";
inline constexpr char16_t kCancel[] = u"&Cancelar";

}  // namespace designer
