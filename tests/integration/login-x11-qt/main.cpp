#include "Desktop.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <QApplication>
#include <cstdlib>
#include <optional>

int main(int argc, char** argv) {
  testing::InitGoogleMock(&argc, argv);
  if (testing::GTEST_FLAG(list_tests)) {
    return RUN_ALL_TESTS();
  }
  const auto desktop = Desktop::start(missingDesktop());
  std::optional<QApplication> application;
  if (desktop) {
    ::setenv("QT_QPA_PLATFORM", "xcb", 1);
    ::setenv("QT_STYLE_OVERRIDE", "fusion", 1);
    application.emplace(argc, argv);
  }
  return RUN_ALL_TESTS();
}
