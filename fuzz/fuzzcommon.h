// SPDX-License-Identifier: MIT
// What the fuzz harnesses share: the entry point libFuzzer calls, a check that ends the run on a broken
// invariant (so that the fuzzer keeps the input), and the Qt application some readers need.
#pragma once

#include <QByteArray>

#include <cstddef>
#include <cstdint>

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size);

namespace fuzz {

/// The input as bytes (shared, not copied: valid during the call only).
inline QByteArray bytesOf(const uint8_t* data, size_t size) {
  return QByteArray::fromRawData(reinterpret_cast<const char*>(data), static_cast<qsizetype>(size));
}

/// Aborts with `what` when `holds` is false.
void check(bool holds, const char* what);

/// Creates the application object once (the model's timers and file paths want one).
void ensureApplication();

}  // namespace fuzz
