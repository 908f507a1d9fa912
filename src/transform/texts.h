// SPDX-License-Identifier: MIT
// The numbers in the string table of the numbering and indentation texts, named. A run of
// consecutive numbers (the scope buttons) is named by its first.
#pragma once

namespace transform {

// frmIndenter
inline constexpr int kIndenterCaption = 5135;
inline constexpr int kIndentFrame = 5016;
inline constexpr int kUseFrame = 5017;
inline constexpr int kIndentScopeFirst = 5018;  // project, module, procedure
inline constexpr int kIndentCharsFirst = 5021;  // tabs, spaces
inline constexpr int kIndenterCancel = 5024;
inline constexpr int kIndenterClose = 5025;
inline constexpr int kIndentButton = 5026;
inline constexpr int kInvalidSpaces = 5124;
inline constexpr int kNoSpaces = 5125;
inline constexpr int kIndentRunFailed = 5126;
inline constexpr int kIndenterLoadFailed = 5127;

// frmLinNumbers
inline constexpr int kNumbersCaption = 5036;
inline constexpr int kNumbersFrame = 5027;
inline constexpr int kNumberScopeFirst = 5028;  // project, module, procedure
inline constexpr int kStartNumberLabel = 5031;
inline constexpr int kIntervalLabel = 5032;
inline constexpr int kAddNumbersButton = 5033;
inline constexpr int kRemoveNumbersButton = 5034;
inline constexpr int kNumbersCancel = 5035;
inline constexpr int kNumbersClose = 5161;
inline constexpr int kStartNotNumeric = 5119;
inline constexpr int kIntervalNotNumeric = 5120;

// The walks' failures.
inline constexpr int kNumberProjectFailed = 5121;
inline constexpr int kNumberModuleFailed = 5122;
inline constexpr int kNumberProcedureFailed = 5123;
inline constexpr int kIndentProjectFailed = 5130;
inline constexpr int kIndentModuleFailed = 5129;
inline constexpr int kIndentProcedureFailed = 5128;

}  // namespace transform
