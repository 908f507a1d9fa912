// SPDX-License-Identifier: MIT
// The numbers in the string table of the favourites' texts, named.
#pragma once

namespace navigation {

// frmOrgFav
inline constexpr int kFavoritesCaption = 5061;
inline constexpr int kProcedureColumn = 5062;
inline constexpr int kLineColumn = 5063;
inline constexpr int kModuleColumn = 5162;
inline constexpr int kCannotShow = 5114;
inline constexpr int kMayBeGone = 5115;

// CFavorites
inline constexpr int kAddFailed = 5084;
inline constexpr int kRecordFailed = 5116;

}  // namespace navigation
