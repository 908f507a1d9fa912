// SPDX-License-Identifier: MIT
// Entry point of the dialog tests: a QApplication on the offscreen platform (also when ctest discovers the
// tests at build time), and the user's settings and logs kept in a directory of their own.
#include <gtest/gtest.h>

#include <QApplication>
#include <QTemporaryDir>

int main(int argc, char** argv) {
  if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM")) qputenv("QT_QPA_PLATFORM", QByteArray("offscreen"));
  QTemporaryDir home;
  qputenv("QUIMBEL_CONFIG_DIR", home.filePath(u"config"_qs).toLocal8Bit());
  qputenv("QUIMBEL_DATA_DIR", home.filePath(u"data"_qs).toLocal8Bit());
  QApplication app(argc, argv);
  ::testing::InitGoogleTest(&argc, argv);
  return RUN_ALL_TESTS();
}
