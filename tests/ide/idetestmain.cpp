// SPDX-License-Identifier: MIT
// Entry point of the widget tests: one QApplication for every test, headless unless a display is asked for
// (ctest discovers the tests at build time without the test environment).
#include <gtest/gtest.h>

#include <QApplication>
#include <QByteArray>

int main(int argc, char** argv) {
  if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM")) qputenv("QT_QPA_PLATFORM", QByteArray("offscreen"));
  QApplication app(argc, argv);
  QApplication::setStyle(u"Fusion"_qs);
  ::testing::InitGoogleTest(&argc, argv);
  return RUN_ALL_TESTS();
}
