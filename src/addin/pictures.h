// SPDX-License-Identifier: MIT
// The pictures of the add-in's commands: 16 by 16 images embedded in the library, by bitmap number.
#pragma once

#include <QByteArray>

namespace addin {

/// The image file (XPM) of bitmap `number`; empty for a number the add-in has no picture for.
QByteArray pictureData(int number);

}  // namespace addin
