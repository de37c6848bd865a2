#include "Desktop.h"
#include "support/ChildProgram.h"

#include <LumoraKit/LumoraKit.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <QApplication>
#include <cstdlib>
#include <optional>

// One desktop for all tests of the program: the devices' own screen, with a window manager.
int main(int argc, char** argv) {
  testing::InitGoogleMock(&argc, argv);
  if (testing::GTEST_FLAG(list_tests)) {
    return RUN_ALL_TESTS();
  }
  auto& desktop = recorder::desktop();
  desktop.devices = lumora::testing::HeadlessDevices::start(desktop.missing);
  std::optional<QApplication> application;
  std::unique_ptr<lumora::tests::ChildProgram> manager;
  if (desktop.devices) {
    manager = lumora::tests::ChildProgram::start({"jwm"});
    desktop.missing = manager ? "" : "jwm is not installed";
    ::setenv("QT_QPA_PLATFORM", "xcb", 1);
    ::setenv("QT_STYLE_OVERRIDE", "fusion", 1);
    lumora::Application::setIdentity("org.vantor.lumora.recorder", "Lumora Recorder");
    application.emplace(argc, argv);
  }
  const int status = RUN_ALL_TESTS();
  application.reset();
  manager.reset();
  desktop.devices.reset();
  return status;
}
