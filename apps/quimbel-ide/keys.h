// SPDX-License-Identifier: MIT
// Key presses as the IDE's window system sees them: Win32 virtual-key codes and hotkey modifier bits.
#pragma once

#include <Qt>

namespace desktop {

struct VirtualKey {
  unsigned modifiers = 0;  // ide::mod bits
  unsigned key = 0;        // 0: the key has no virtual-key code
};

/// The virtual key of a Qt key press. Shifted symbols of the US layout ("!" for Shift+1) map back to the key
/// that carries them, since a hotkey is registered on the key, not on the character.
VirtualKey virtualKeyOf(int qtKey, Qt::KeyboardModifiers modifiers);

}  // namespace desktop
