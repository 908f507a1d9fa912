// SPDX-License-Identifier: MIT
// Helpers shared by the file-format tests: sample files written readably in the test source (UTF-8, "\n")
// and turned into what the IDE writes (Windows-1252, CRLF), and a check that an action throws ide::Error.
#pragma once

#include "host/files/ansi.h"

#include "ide/error.h"

#include <gtest/gtest.h>

#include <QByteArray>
#include <QString>

#include <string>

namespace host::testing {

/// The sample as a file on disk: Windows-1252 bytes with CRLF line ends.
inline QByteArray windowsFile(const char* utf8) {
  const QString text = QString::fromUtf8(utf8).replace(u"\n"_qs, u"\r\n"_qs);
  const std::optional<QByteArray> bytes = encodeAnsi(text);
  EXPECT_TRUE(bytes.has_value()) << "a sample holds a character outside Windows-1252";
  return bytes.value_or(QByteArray());
}

/// `bytes` with the single occurrence of `from` replaced by `to` (both UTF-8, "\n" for line ends); fails
/// the test when `from` does not occur exactly once, so that an expectation cannot silently go stale.
inline QByteArray replacedOnce(const QByteArray& bytes, const char* from, const char* to) {
  const QByteArray oldBytes = windowsFile(from);
  const QByteArray newBytes = windowsFile(to);
  EXPECT_EQ(bytes.count(oldBytes), 1) << "sample text: " << from;
  QByteArray result = bytes;
  return result.replace(oldBytes, newBytes);
}

/// Bytes as a std::string, so that a failed comparison prints readable lines.
inline std::string asText(const QByteArray& bytes) {
  return bytes.toStdString();
}

/// Runs `action`, expecting an ide::Error, and returns it.
template <typename Action>
ide::Error expectError(Action&& action) {
  try {
    action();
  } catch (const ide::Error& error) {
    return error;
  }
  ADD_FAILURE() << "no ide::Error thrown";
  return ide::Error(0, {});
}

}  // namespace host::testing
