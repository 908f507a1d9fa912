// SPDX-License-Identifier: MIT
#include "keys.h"

#include "ide/platform.h"

#include <QKeyEvent>

namespace desktop {
namespace {

struct KeyCode {
  int qtKey;
  unsigned vk;
};

// Keys whose Win32 code differs from their Qt code. Letters and digits share their ASCII codes.
constexpr KeyCode kKeys[] = {
    {Qt::Key_Backspace, 0x08},
    {Qt::Key_Tab, 0x09},
    {Qt::Key_Backtab, 0x09},
    {Qt::Key_Return, 0x0D},
    {Qt::Key_Enter, 0x0D},
    {Qt::Key_Pause, 0x13},
    {Qt::Key_Escape, 0x1B},
    {Qt::Key_Space, 0x20},
    {Qt::Key_PageUp, 0x21},
    {Qt::Key_PageDown, 0x22},
    {Qt::Key_End, 0x23},
    {Qt::Key_Home, 0x24},
    {Qt::Key_Left, 0x25},
    {Qt::Key_Up, 0x26},
    {Qt::Key_Right, 0x27},
    {Qt::Key_Down, 0x28},
    {Qt::Key_Insert, 0x2D},
    {Qt::Key_Delete, 0x2E},
    {Qt::Key_Semicolon, 0xBA},
    {Qt::Key_Equal, 0xBB},
    {Qt::Key_Comma, 0xBC},
    {Qt::Key_Minus, 0xBD},
    {Qt::Key_Period, 0xBE},
    {Qt::Key_Slash, 0xBF},
    {Qt::Key_QuoteLeft, 0xC0},
    {Qt::Key_BracketLeft, 0xDB},
    {Qt::Key_Backslash, 0xDC},
    {Qt::Key_BracketRight, 0xDD},
    {Qt::Key_Apostrophe, 0xDE},
    // Shifted symbols of the US layout, on the keys that carry them (the digits' ones only when the
    // event has no native codes to tell the key by).
    {Qt::Key_Exclam, '1'},
    {Qt::Key_At, '2'},
    {Qt::Key_NumberSign, '3'},
    {Qt::Key_Dollar, '4'},
    {Qt::Key_Percent, '5'},
    {Qt::Key_AsciiCircum, '6'},
    {Qt::Key_Ampersand, '7'},
    {Qt::Key_Asterisk, '8'},
    {Qt::Key_ParenLeft, '9'},
    {Qt::Key_ParenRight, '0'},
    {Qt::Key_Colon, 0xBA},
    {Qt::Key_Plus, 0xBB},
    {Qt::Key_Less, 0xBC},
    {Qt::Key_Underscore, 0xBD},
    {Qt::Key_Greater, 0xBE},
    {Qt::Key_Question, 0xBF},
    {Qt::Key_AsciiTilde, 0xC0},
    {Qt::Key_BraceLeft, 0xDB},
    {Qt::Key_Bar, 0xDC},
    {Qt::Key_BraceRight, 0xDD},
    {Qt::Key_QuoteDbl, 0xDE},
};

/// XKB key codes of the main block's digit keys, 1 to 9 then 0 (Linux input codes 2 to 11, plus 8).
constexpr quint32 kXkbDigitOne = 10;
constexpr quint32 kXkbDigitZero = 19;

bool isShiftedUsDigit(int qtKey) {
  for (const int key :
       {Qt::Key_Exclam, Qt::Key_At, Qt::Key_NumberSign, Qt::Key_Dollar, Qt::Key_Percent, Qt::Key_AsciiCircum,
        Qt::Key_Ampersand, Qt::Key_Asterisk, Qt::Key_ParenLeft, Qt::Key_ParenRight})
    if (key == qtKey) return true;
  return false;
}

/// The digit ('0' to '9') of the main block's key that was pressed, when the native codes tell it.
unsigned physicalDigit(const QKeyEvent& event, NativeKeyCodes codes) {
  switch (codes) {
    case NativeKeyCodes::Xkb: {
      const quint32 code = event.nativeScanCode();
      if (code < kXkbDigitOne || code > kXkbDigitZero) return 0;
      return code == kXkbDigitZero ? '0' : '1' + (code - kXkbDigitOne);
    }
    case NativeKeyCodes::Windows: {
      const quint32 vk = event.nativeVirtualKey();
      return vk >= '0' && vk <= '9' ? vk : 0;
    }
    case NativeKeyCodes::None:
      break;
  }
  return 0;
}

}  // namespace

NativeKeyCodes nativeKeyCodesOf(const QString& platformName) {
  if (platformName == QLatin1StringView("xcb") || platformName.startsWith(QLatin1StringView("wayland")))
    return NativeKeyCodes::Xkb;
  if (platformName == QLatin1StringView("windows")) return NativeKeyCodes::Windows;
  return NativeKeyCodes::None;
}

VirtualKey virtualKeyOf(const QKeyEvent& event, NativeKeyCodes codes) {
  const bool native = codes != NativeKeyCodes::None && event.nativeScanCode() != 0;
  VirtualKey result = virtualKeyOf(event.key(), event.modifiers());
  if (!native) return result;
  if (const unsigned digit = physicalDigit(event, codes)) {
    result.key = digit;
  } else if ((event.key() >= Qt::Key_0 && event.key() <= Qt::Key_9) || isShiftedUsDigit(event.key())) {
    // A digit or a US digit's symbol typed on another key (the keypad, or a layout's own place for it)
    // is not the digit key.
    result.key = 0;
  }
  return result;
}

VirtualKey virtualKeyOf(int qtKey, Qt::KeyboardModifiers modifiers) {
  VirtualKey result;
  if (modifiers & Qt::AltModifier) result.modifiers |= ide::mod::Alt;
  if (modifiers & Qt::ControlModifier) result.modifiers |= ide::mod::Control;
  if (modifiers & Qt::ShiftModifier) result.modifiers |= ide::mod::Shift;
  if ((qtKey >= Qt::Key_A && qtKey <= Qt::Key_Z) || (qtKey >= Qt::Key_0 && qtKey <= Qt::Key_9)) {
    result.key = static_cast<unsigned>(qtKey);
  } else if (qtKey >= Qt::Key_F1 && qtKey <= Qt::Key_F24) {
    result.key = 0x70 + static_cast<unsigned>(qtKey - Qt::Key_F1);
  } else {
    for (const KeyCode& code : kKeys)
      if (code.qtKey == qtKey) result.key = code.vk;
  }
  return result;
}

}  // namespace desktop
