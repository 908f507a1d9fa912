// SPDX-License-Identifier: MIT
// What the database worker process writes, so that the tests can tell each version of its text.
#pragma once

#include <QString>

namespace appdata::test {

/// Version `n` of the worker's text: long enough to span a few hundred database pages.
inline QString workerText(int n) {
  return QString(300'000, QChar(u'a' + n % 26)) + QString::number(n);
}

}  // namespace appdata::test
