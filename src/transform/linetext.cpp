// SPDX-License-Identifier: MIT
// The number test behind line numbers and numeric labels.
#include "transform/linetext.h"

namespace transform {

bool isNumeric(QStringView text) noexcept {
  const QStringView t = trimmedView(text);
  qsizetype i = 0;
  if (i < t.size() && (t[i] == u'+' || t[i] == u'-')) ++i;
  bool digit = false;
  bool point = false;
  for (; i < t.size(); ++i) {
    const QChar c = t[i];
    if (c >= u'0' && c <= u'9') {
      digit = true;
    } else if (c == u'.' && !point) {
      point = true;
    } else {
      return false;
    }
  }
  return digit;
}

}  // namespace transform
