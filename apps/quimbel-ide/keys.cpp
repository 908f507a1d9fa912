// SPDX-License-Identifier: MIT
#include "keys.h"

#include "ide/platform.h"

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
    // Shifted symbols of the US layout, on the keys that carry them.
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

}  // namespace

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
