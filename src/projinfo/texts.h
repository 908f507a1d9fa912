// SPDX-License-Identifier: MIT
// Messages about project info files that have no number in the string table. Brazilian Portuguese, as
// every text the user reads.
#pragma once

namespace projinfo {

/// %1 the project, %2 the file, %3 the reason.
inline constexpr char16_t kCannotOpenInfoFile[] =
    u"Não foi possível abrir o arquivo de informações do projeto %1, %2: %3.\n\nO arquivo foi deixado "
    u"como está; as tarefas e os favoritos deste projeto ficam indisponíveis nesta sessão.";
inline constexpr char16_t kCannotWriteInfoFile[] =
    u"Não foi possível gravar o arquivo de informações do projeto %1, %2: %3.\n\nAs tarefas e os "
    u"favoritos continuam disponíveis enquanto o projeto estiver aberto, mas as mudanças não serão "
    u"guardadas.";
/// %1 the project, %2 the old place, %3 the new one, %4 the reason.
inline constexpr char16_t kCannotMoveInfoFile[] =
    u"Não foi possível levar o arquivo de informações do projeto %1 de %2 para %3: %4.\n\nO arquivo "
    u"continua onde estava.";
/// %1 the module, %2 the project, %3 the file.
inline constexpr char16_t kTieLost[] =
    u"O módulo %1, que liga o projeto %2 ao seu arquivo de informações (%3), foi removido ou renomeado. "
    u"O arquivo foi fechado e mantido; as tarefas e os favoritos voltam quando o módulo voltar ao "
    u"projeto.";

/// %1 the project that has the file, %2 the one refused it, %3 the identifier, %4 its module, %5 the file.
inline constexpr char16_t kSharedIdentifier[] =
    u"Os projetos %1 e %2 têm o mesmo identificador, %3 (no módulo %4), e por isso o mesmo arquivo de "
    u"informações, %5 (isso acontece quando um projeto é copiado com o seu módulo de identificação). O "
    u"arquivo fica com %1; as tarefas e os favoritos de %2 ficam indisponíveis nesta sessão, e o arquivo não "
    u"é alterado "
    u"por ele.";

// Reasons.
inline constexpr char16_t kInUse[] = u"ele está em uso por outro programa (%1)";
inline constexpr char16_t kNotAnInfoFile[] = u"ele não é um arquivo de informações do Quimbel";
inline constexpr char16_t kDamaged[] = u"ele está danificado ou incompleto (%1)";
inline constexpr char16_t kNoAccess[] = u"sem permissão de acesso ao arquivo ou à sua pasta";
inline constexpr char16_t kExists[] = u"já existe um arquivo com esse nome lá";
inline constexpr char16_t kOtherFailure[] = u"%1";

// The numbers in the string table of the task list's texts, named.
// frmTasks
inline constexpr int kTasksCaption = 5151;
inline constexpr int kTasksHeader = 5079;
inline constexpr int kAddTask = 5080;
inline constexpr int kRemoveTask = 5081;
inline constexpr int kEditTask = 5082;
inline constexpr int kCloseTasks = 5083;
inline constexpr int kRemoveFailed = 5089;
// frmNewTask
inline constexpr int kTaskNameLabel = 5057;
inline constexpr int kTaskDescriptionLabel = 5058;
inline constexpr int kTaskCancel = 5059;
inline constexpr int kEmptyName = 5088;
inline constexpr int kSaveChanges = 5087;

}  // namespace projinfo
