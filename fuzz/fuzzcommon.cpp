// SPDX-License-Identifier: MIT
#include "fuzzcommon.h"

#include <QCoreApplication>

#include <cstdio>
#include <cstdlib>

namespace fuzz {

void check(bool holds, const char* what) {
  if (holds) return;
  std::fprintf(stderr, "invariant broken: %s\n", what);
  std::abort();
}

void ensureApplication() {
  if (QCoreApplication::instance()) return;
  static int argc = 1;
  static char name[] = "quimbel-fuzz";
  static char* argv[] = {name, nullptr};
  static QCoreApplication application(argc, argv);
}

}  // namespace fuzz
