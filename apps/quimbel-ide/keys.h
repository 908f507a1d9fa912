// SPDX-License-Identifier: MIT
// Key presses as the IDE's window system sees them: Win32 virtual-key codes and hotkey modifier bits.
#pragma once

#include <QString>
#include <Qt>

class QKeyEvent;

namespace desktop {

struct VirtualKey {
  unsigned modifiers = 0;  // ide::mod bits
  unsigned key = 0;        // 0: the key has no virtual-key code
};

/// What a key event's native codes are, by window system.
enum class NativeKeyCodes {
  None,     // none (synthetic events, the offscreen platform)
  Xkb,      // X11 and Wayland: the scan code is the XKB key code (the Linux input code + 8)
  Windows,  // the native virtual key is Win32's own
};
NativeKeyCodes nativeKeyCodesOf(const QString& platformName);

/// The virtual key of a Qt key press. Shifted symbols of the US layout ("!" for Shift+1) map back to the key
/// that carries them, since a hotkey is registered on the key, not on the character.
VirtualKey virtualKeyOf(int qtKey, Qt::KeyboardModifiers modifiers);

/// The virtual key of a key event. The digit keys of the main block are told by the physical key, as
/// Win32 does: what they type with Shift (or at all, as on a French layout) depends on the layout, and may
/// be a dead key. Without native codes, the event's key decides as above.
VirtualKey virtualKeyOf(const QKeyEvent& event, NativeKeyCodes codes);

}  // namespace desktop
