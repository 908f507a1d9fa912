// SPDX-License-Identifier: MIT
// The numbers in the string table of the extended find's texts, named. A run of consecutive
// numbers is named by its first.
#pragma once

namespace find {

// frmFind
inline constexpr int kFindCaption = 5003;
inline constexpr int kFindWhereFrame = 5004;
inline constexpr int kFindTextLabel = 5005;
inline constexpr int kFindScopeFirst = 5006;  // everything, active project, active module
inline constexpr int kWholeWords = 5009;
inline constexpr int kMatchCase = 5010;
inline constexpr int kUsePattern = 5011;
inline constexpr int kStopSearch = 5012;
inline constexpr int kFindButton = 5013;
inline constexpr int kFindClose = 5014;
inline constexpr int kResults = 5015;
inline constexpr int kSearching = 5131;
inline constexpr int kResultsIn = 5132;
inline constexpr int kCompleted = 5133;
inline constexpr int kLinesFound = 5134;
inline constexpr int kSearchFailed = 5110;

// The result list's column captions: project, module, procedure, text found.
inline constexpr int kFirstCaption = 5064;

// Going to an occurrence.
inline constexpr int kProjectGone = 5111;
inline constexpr int kNoCodeWindow = 5112;
inline constexpr int kInActiveProject = 5113;

}  // namespace find
