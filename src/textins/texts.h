// SPDX-License-Identifier: MIT
// The numbers in the string table of the macro and copy-buffer texts, named.
#pragma once

namespace textins {

inline constexpr int kReservedWordsButton = 5038;
inline constexpr int kMacrosLoadFailed = 5152;
inline constexpr int kCopyBuffersLoadFailed = 5163;
inline constexpr int kUndeterminedError = 5091;
inline constexpr int kInsertionFailed = 5096;
inline constexpr int kHelpNotFound = 5158;

}  // namespace textins
