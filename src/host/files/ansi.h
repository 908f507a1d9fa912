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

QString decodeAnsi(QByteArrayView bytes);

/// The bytes of `text`, or nothing when a character has no byte in the code page; then `firstBad`
/// (when given) receives the index of that character.
std::optional<QByteArray> encodeAnsi(QStringView text, qsizetype* firstBad = nullptr);

/// Appends the bytes of `text` to `out`; false (with `out` partly appended) when a character has none.
bool appendAnsi(QByteArray& out, QStringView text, qsizetype* firstBad = nullptr);

}  // namespace host
