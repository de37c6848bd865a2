#include "Reader.h"
#include "support/TestDesktop.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <QApplication>
#include <cstdlib>
#include <iostream>
#include <optional>

int main(int argc, char** argv) {
  using lumora::tests::AccessibilityBus;
  using lumora::tests::TestDesktop;
  testing::InitGoogleMock(&argc, argv);
  if (testing::GTEST_FLAG(list_tests)) {
    return RUN_ALL_TESTS();
  }
  TestDesktop desktop;
  AccessibilityBus bus;
  std::optional<QApplication> application;
  if (!TestDesktop::obstacle() && !AccessibilityBus::obstacle()) {
    if (!desktop.start() || !bus.start()) {
      std::cerr << "Xvfb, jwm or the accessibility bus does not start\n";
      return EXIT_FAILURE;
    }
    ::setenv("QT_QPA_PLATFORM", "xcb", 1);
    ::setenv("QT_STYLE_OVERRIDE", "fusion", 1);
    application.emplace(argc, argv);
  }
  return RUN_ALL_TESTS();
}
