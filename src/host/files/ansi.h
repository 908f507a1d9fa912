// SPDX-License-Identifier: MIT
// The IDE's ANSI code page, Windows-1252. The five bytes that code page leaves undefined (0x81, 0x8D, 0x8F,
// 0x90, 0x9D) are read as the control characters U+0081 ... of the same value and written back as the same
// bytes, so that every byte of a file survives a load and a save unchanged.
#pragma once

#include <QByteArray>
#include <QByteArrayView>
#include <QString>
#include <QStringView>

#include <optional>

namespace host {

/// How source text is read and written. VB6 files are in the ANSI code page; files that other tools turned
/// into UTF-8 can be taken as UTF-8 instead. Then a byte that is not part of valid UTF-8 is read as the
/// character U+DC00 plus its value (a lone low surrogate no valid UTF-8 gives) and written back as the same
/// byte, so that every file still survives a load and a save unchanged.
enum class SourceEncoding { Ansi, Utf8 };

/// For the whole process; set before any file is read. Returns the encoding it replaces.
SourceEncoding setSourceEncoding(SourceEncoding encoding);
SourceEncoding sourceEncoding();

/// True when `bytes` hold a byte above 0x7F and are valid UTF-8 throughout: text that a UTF-8 editor
/// wrote, which read in the ANSI code page would show each accented letter as two characters.
bool looksLikeUtf8(QByteArrayView bytes);

QString decodeAnsi(QByteArrayView bytes);

/// The bytes of `text`, or nothing when a character has no byte in the code page; then `firstBad`
/// (when given) receives the index of that character.
std::optional<QByteArray> encodeAnsi(QStringView text, qsizetype* firstBad = nullptr);

/// Appends the bytes of `text` to `out`; false (with `out` partly appended) when a character has none.
bool appendAnsi(QByteArray& out, QStringView text, qsizetype* firstBad = nullptr);

}  // namespace host
