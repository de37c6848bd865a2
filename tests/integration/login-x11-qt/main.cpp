#include "support/TestDesktop.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <QApplication>
#include <cstdlib>
#include <iostream>
#include <optional>

int main(int argc, char** argv) {
  using lumora::tests::TestDesktop;
  testing::InitGoogleMock(&argc, argv);
  if (testing::GTEST_FLAG(list_tests)) {
    return RUN_ALL_TESTS();
  }
  TestDesktop desktop;
  std::optional<QApplication> application;
  if (!TestDesktop::obstacle()) {
    if (!desktop.start()) {
      std::cerr << "Xvfb or jwm does not start\n";
      return EXIT_FAILURE;
    }
    ::setenv("QT_QPA_PLATFORM", "xcb", 1);
    ::setenv("QT_STYLE_OVERRIDE", "fusion", 1);
    application.emplace(argc, argv);
  }
  return RUN_ALL_TESTS();
}
