// SPDX-License-Identifier: MIT
// The add-in's fixed texts and names: what it calls itself and the messages that have no number in the
// string table. Texts are Brazilian Portuguese and stay exactly as they are.
#pragma once

namespace addin {

inline constexpr char kProgId[] = "Quimbel.Connect";
inline constexpr char kDescription[] = "Quimbel 2.2 Add-In";
inline constexpr char kDetails[] =
    "Navegação pelo código, favoritos, tarefas, macros de teclado, memórias de cópia, numeração e "
    "indentação de linhas, localização estendida, novo procedimento e assistência ao desenho de "
    "formulários.";
inline constexpr char kToolBarName[] = "Quimbel 2.2";
inline constexpr char16_t kSplashText[] = u"Quimbel 2.2";

inline constexpr char16_t kInstallDirMissing[] =
    u"Erro: não foi possível detectar o diretório de instalação.";
inline constexpr char16_t kStartupFailed[] = u"Erro de inicialização.";
inline constexpr char16_t kHelpNotFound[] = u"Não foi possível localizar o arquivo de ajuda.";
inline constexpr char16_t kUndeterminedError[] = u"Erro indeterminado.";
/// Logged only (the user sees kStartupFailed).
inline constexpr char16_t kNoConfigurationAccess[] = u"Sem acesso de leitura à configuração da máquina.";

/// The window message posted to run work once the IDE is idle.
inline constexpr char kIdleMessageName[] = "QM_ONIDLE_MSG";

/// Numbers in the string table.
inline constexpr int kNoAddInsMenuText = 201;
inline constexpr int kAddFavoriteFailed = 5084;

}  // namespace addin
