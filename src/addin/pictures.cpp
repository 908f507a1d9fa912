// SPDX-License-Identifier: MIT
#include "addin/pictures.h"

#include <QFile>
#include <QString>

namespace addin {

QByteArray pictureData(int number) {
  QFile file(QStringLiteral(":/quimbel/icons/bmp%1.xpm").arg(number));
  if (!file.open(QIODevice::ReadOnly)) return {};
  return file.readAll();
}

}  // namespace addin
