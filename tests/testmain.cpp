// SPDX-License-Identifier: MIT
// Test entry point: a QCoreApplication-free main that keeps Qt headless, even when ctest discovers the
// tests at build time without the test environment.
#include <gtest/gtest.h>

#include <QByteArray>
#include <QtGlobal>

int main(int argc, char** argv) {
  if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM")) qputenv("QT_QPA_PLATFORM", QByteArray("offscreen"));
  ::testing::InitGoogleTest(&argc, argv);
  return RUN_ALL_TESTS();
}
