// SPDX-License-Identifier: MIT
#include "syntax/text.h"

#include <QStringDecoder>

namespace syntax {
namespace {

/// For each Windows-1252 byte: bit 0 when it decodes to an identifier character, bit 1 to a letter.
const std::array<unsigned char, 256>& ansiClasses() {
  static const std::array<unsigned char, 256> classes = [] {
    std::array<unsigned char, 256> table{};
    QStringDecoder decoder("Windows-1252");
    for (int b = 0; b < 256; ++b) {
      const char byte = char(b);
      const QString text = decoder.decode(QByteArrayView(&byte, 1));
      // The five bytes the code page leaves undefined are no letters, whatever the decoder makes of them.
      const char16_t c = text.size() == 1 ? text.front().unicode() : u'\0';
      table[size_t(b)] = (isIdentifierChar(c) ? 1 : 0) | (isIdentifierStart(c) ? 2 : 0);
    }
    return table;
  }();
  return classes;
}

}  // namespace

bool isIdentifierChar(char byte) noexcept {
  return ansiClasses()[static_cast<unsigned char>(byte)] & 1;
}

bool isIdentifierStart(char byte) noexcept {
  return ansiClasses()[static_cast<unsigned char>(byte)] & 2;
}

bool isNumeric(QStringView text) noexcept {
  const QStringView t = trimmedView(text);
  qsizetype i = 0;
  if (i < t.size() && (t[i] == u'+' || t[i] == u'-')) ++i;
  bool digit = false;
  bool point = false;
  for (; i < t.size(); ++i) {
    const char16_t c = t[i].unicode();
    if (isDigit(c)) {
      digit = true;
    } else if (c == u'.' && !point) {
      point = true;
    } else {
      return false;
    }
  }
  return digit;
}

}  // namespace syntax
