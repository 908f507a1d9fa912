// SPDX-License-Identifier: MIT
// The numbers in the string table of the new-procedure wizard's texts, named. A run of
// consecutive numbers (the tabs) is named by its first.
#pragma once

namespace newproc {

// frmNewProc
inline constexpr int kNewProcCaption = 5136;
inline constexpr int kNewProcTabFirst = 5041;  // new procedure, error handler, documentation
inline constexpr int kNameLabel = 5044;
inline constexpr int kProcTypeFrame = 5045;
inline constexpr int kScopeFrame = 5046;
inline constexpr int kPropertyProcsFrame = 5047;
inline constexpr int kMemberVariableLabel = 5048;
inline constexpr int kDataTypeLabel = 5049;
inline constexpr int kReturnTypeLabel = 5137;
inline constexpr int kIsObject = 5050;
inline constexpr int kErrorHandler = 5051;
inline constexpr int kDocHeader = 5052;
inline constexpr int kNewProcCancel = 5053;
inline constexpr int kNewProcHelp = 5054;
inline constexpr int kEnterErrorHandler = 5055;
inline constexpr int kEnterDocHeader = 5056;
inline constexpr int kCreated = 5098;
inline constexpr int kCreateAnother = 5099;
inline constexpr int kCreationFailed = 5100;

// The names and types the wizard refuses.
inline constexpr int kInvalidName = 5105;
inline constexpr int kInvalidDataType = 5106;
inline constexpr int kInvalidMemberVariable = 5107;
inline constexpr int kNoPropertyProcs = 5108;
inline constexpr int kVariantNeedsLetAndSet = 5109;
inline constexpr int kNameInUse = 5117;
inline constexpr int kMemberVariableInUse = 5118;

}  // namespace newproc
