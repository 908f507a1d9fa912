// SPDX-License-Identifier: MIT
// Windows-1252 through two small tables: one lookup per byte when reading, and when writing one range check
// per character with a switch only for the 27 characters the code page places in 0x80..0x9F.
#include "host/files/ansi.h"

#include <algorithm>

#include <array>
#include <atomic>

namespace host {
namespace {

std::atomic<SourceEncoding> g_encoding{SourceEncoding::Ansi};

/// The length of the valid UTF-8 sequence at `in[i]` (2 to 4), or 0.
qsizetype utf8SequenceLength(const unsigned char* in, qsizetype i, qsizetype size) {
  const unsigned char lead = in[i];
  qsizetype length = 0;
  unsigned char low = 0x80;
  unsigned char high = 0xBF;
  if (lead >= 0xC2 && lead <= 0xDF) {
    length = 2;
  } else if (lead >= 0xE0 && lead <= 0xEF) {
    length = 3;
    if (lead == 0xE0) low = 0xA0;   // no overlong forms
    if (lead == 0xED) high = 0x9F;  // no surrogates
  } else if (lead >= 0xF0 && lead <= 0xF4) {
    length = 4;
    if (lead == 0xF0) low = 0x90;
    if (lead == 0xF4) high = 0x8F;  // nothing past U+10FFFF
  } else {
    return 0;
  }
  if (i + length > size || in[i + 1] < low || in[i + 1] > high) return 0;
  for (qsizetype k = 2; k < length; ++k)
    if ((in[i + k] & 0xC0) != 0x80) return 0;
  return length;
}

QString decodeUtf8(QByteArrayView bytes) {
  QString text;
  text.reserve(bytes.size());
  const auto* in = reinterpret_cast<const unsigned char*>(bytes.data());
  for (qsizetype i = 0, size = bytes.size(); i < size;) {
    if (in[i] < 0x80) {
      text += QChar(in[i++]);
      continue;
    }
    const qsizetype length = utf8SequenceLength(in, i, size);
    if (length == 0) {
      text += QChar(char16_t(0xDC00 + in[i++]));
      continue;
    }
    char32_t code = in[i] & (0xFF >> (length + 1));
    for (qsizetype k = 1; k < length; ++k)
      code = (code << 6) | (in[i + k] & 0x3F);
    text += QChar::fromUcs4(code);
    i += length;
  }
  return text;
}

bool appendUtf8(QByteArray& out, QStringView text, qsizetype* firstBad) {
  for (qsizetype i = 0, size = text.size(); i < size; ++i) {
    const char16_t c = text[i].unicode();
    char32_t code = c;
    if (QChar::isHighSurrogate(c) && i + 1 < size && QChar::isLowSurrogate(text[i + 1].unicode())) {
      code = QChar::surrogateToUcs4(c, text[++i].unicode());
    } else if (c >= 0xDC80 && c <= 0xDCFF) {
      out += char(c - 0xDC00);  // a byte that was not valid UTF-8
      continue;
    } else if (QChar::isSurrogate(c)) {
      if (firstBad) *firstBad = i;
      return false;
    }
    if (code < 0x80) {
      out += char(code);
    } else if (code < 0x800) {
      out += char(0xC0 | (code >> 6));
      out += char(0x80 | (code & 0x3F));
    } else if (code < 0x10000) {
      out += char(0xE0 | (code >> 12));
      out += char(0x80 | ((code >> 6) & 0x3F));
      out += char(0x80 | (code & 0x3F));
    } else {
      out += char(0xF0 | (code >> 18));
      out += char(0x80 | ((code >> 12) & 0x3F));
      out += char(0x80 | ((code >> 6) & 0x3F));
      out += char(0x80 | (code & 0x3F));
    }
  }
  return true;
}

// The characters of bytes 0x80..0x9F; every other byte is the character of the same value.
constexpr std::array<char16_t, 32> kHighControlRange = {
    0x20AC, 0x0081, 0x201A, 0x0192, 0x201E, 0x2026, 0x2020, 0x2021,  // 0x80
    0x02C6, 0x2030, 0x0160, 0x2039, 0x0152, 0x008D, 0x017D, 0x008F,  // 0x88
    0x0090, 0x2018, 0x2019, 0x201C, 0x201D, 0x2022, 0x2013, 0x2014,  // 0x90
    0x02DC, 0x2122, 0x0161, 0x203A, 0x0153, 0x009D, 0x017E, 0x0178,  // 0x98
};

constexpr std::array<char16_t, 256> makeDecodeTable() {
  std::array<char16_t, 256> table{};
  for (int byte = 0; byte < 256; ++byte)
    table[byte] = static_cast<char16_t>(byte);
  for (int byte = 0x80; byte < 0xA0; ++byte)
    table[byte] = kHighControlRange[byte - 0x80];
  return table;
}

constexpr std::array<char16_t, 256> kDecodeTable = makeDecodeTable();

/// The byte of a character outside 0x00..0x7F and 0xA0..0xFF, or -1.
int encodeSpecial(char16_t character) {
  switch (character) {
    case 0x20AC:
      return 0x80;
    case 0x0081:
      return 0x81;
    case 0x201A:
      return 0x82;
    case 0x0192:
      return 0x83;
    case 0x201E:
      return 0x84;
    case 0x2026:
      return 0x85;
    case 0x2020:
      return 0x86;
    case 0x2021:
      return 0x87;
    case 0x02C6:
      return 0x88;
    case 0x2030:
      return 0x89;
    case 0x0160:
      return 0x8A;
    case 0x2039:
      return 0x8B;
    case 0x0152:
      return 0x8C;
    case 0x008D:
      return 0x8D;
    case 0x017D:
      return 0x8E;
    case 0x008F:
      return 0x8F;
    case 0x0090:
      return 0x90;
    case 0x2018:
      return 0x91;
    case 0x2019:
      return 0x92;
    case 0x201C:
      return 0x93;
    case 0x201D:
      return 0x94;
    case 0x2022:
      return 0x95;
    case 0x2013:
      return 0x96;
    case 0x2014:
      return 0x97;
    case 0x02DC:
      return 0x98;
    case 0x2122:
      return 0x99;
    case 0x0161:
      return 0x9A;
    case 0x203A:
      return 0x9B;
    case 0x0153:
      return 0x9C;
    case 0x009D:
      return 0x9D;
    case 0x017E:
      return 0x9E;
    case 0x0178:
      return 0x9F;
    default:
      return -1;
  }
}

}  // namespace

SourceEncoding setSourceEncoding(SourceEncoding encoding) {
  return g_encoding.exchange(encoding);
}

SourceEncoding sourceEncoding() {
  return g_encoding.load(std::memory_order_relaxed);
}

bool looksLikeUtf8(QByteArrayView bytes) {
  const auto* in = reinterpret_cast<const unsigned char*>(bytes.data());
  bool wide = false;
  for (qsizetype i = 0, size = bytes.size(); i < size;) {
    if (in[i] < 0x80) {
      ++i;
      continue;
    }
    const qsizetype length = utf8SequenceLength(in, i, size);
    if (length == 0) return false;
    wide = true;
    i += length;
  }
  return wide;
}

QString decodeAnsi(QByteArrayView bytes) {
  if (sourceEncoding() == SourceEncoding::Utf8) return decodeUtf8(bytes);
  QString text(bytes.size(), Qt::Uninitialized);
  char16_t* out = reinterpret_cast<char16_t*>(text.data());
  const auto* in = reinterpret_cast<const unsigned char*>(bytes.data());
  for (qsizetype i = 0, size = bytes.size(); i < size; ++i)
    out[i] = kDecodeTable[in[i]];
  return text;
}

bool appendAnsi(QByteArray& out, QStringView text, qsizetype* firstBad) {
  if (sourceEncoding() == SourceEncoding::Utf8) return appendUtf8(out, text, firstBad);
  const qsizetype start = out.size();
  const qsizetype size = text.size();
  out.resize(start + size);
  char* target = out.data() + start;
  const char16_t* source = text.utf16();
  // Code is nearly all ASCII: each block is narrowed in one loop the compiler can vectorise, and gone
  // over character by character only when something above 0x7F was in it.
  constexpr qsizetype kBlock = 256;
  for (qsizetype from = 0; from < size; from += kBlock) {
    const qsizetype to = std::min(size, from + kBlock);
    char16_t seen = 0;
    for (qsizetype i = from; i < to; ++i) {
      target[i] = static_cast<char>(source[i]);
      seen |= source[i];
    }
    if (seen < 0x80) continue;
    for (qsizetype i = from; i < to; ++i) {
      const char16_t character = source[i];
      if (character < 0x80 || (character >= 0xA0 && character <= 0xFF)) continue;
      const int byte = encodeSpecial(character);
      if (byte < 0) {
        out.resize(start + i);
        if (firstBad) *firstBad = i;
        return false;
      }
      target[i] = static_cast<char>(byte);
    }
  }
  return true;
}

std::optional<QByteArray> encodeAnsi(QStringView text, qsizetype* firstBad) {
  QByteArray bytes;
  if (!appendAnsi(bytes, text, firstBad)) return std::nullopt;
  return bytes;
}

}  // namespace host
