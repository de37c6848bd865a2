#include <LumoraKit/platform/linux/screencast/ScreenSystem.h>

#include <gtest/gtest.h>

namespace {

using lumora::backend::ScreenSystem;
using lumora::backend::screenSystemOf;

TEST(ScreenSystemOf, isThePortal_whenTheSessionIsWayland) {
  EXPECT_EQ(screenSystemOf({"wayland", "wayland-0", ""}), ScreenSystem::Portal);
}

TEST(ScreenSystemOf, isThePortal_whenAWaylandSessionHasAnXServerForItsXPrograms) {
  EXPECT_EQ(screenSystemOf({"wayland", "wayland-0", ":0"}), ScreenSystem::Portal);
}

TEST(ScreenSystemOf, isThePortal_whenAWaylandSessionHidesItsDisplay) {
  EXPECT_EQ(screenSystemOf({"wayland", "", ":0"}), ScreenSystem::Portal);
  EXPECT_EQ(screenSystemOf({"wayland", "", ""}), ScreenSystem::Portal);
}

TEST(ScreenSystemOf, isTheXServer_whenTheSessionIsX11) {
  EXPECT_EQ(screenSystemOf({"x11", "", ":0"}), ScreenSystem::XServer);
}

TEST(ScreenSystemOf, isTheXServer_whenAnX11SessionHasACompositorInAWindow) {
  EXPECT_EQ(screenSystemOf({"x11", "wayland-0", ":0"}), ScreenSystem::XServer);
}

TEST(ScreenSystemOf, followsTheDisplays_whenAnX11SessionHasNone) {
  EXPECT_EQ(screenSystemOf({"x11", "wayland-0", ""}), ScreenSystem::Portal);
  EXPECT_EQ(screenSystemOf({"x11", "", ""}), ScreenSystem::None);
}

TEST(ScreenSystemOf, followsTheDisplays_whenTheDesktopWasStartedFromATerminal) {
  for (const char* const type : {"", "tty", "unspecified"}) {
    EXPECT_EQ(screenSystemOf({type, "wayland-0", ""}), ScreenSystem::Portal) << type;
    EXPECT_EQ(screenSystemOf({type, "wayland-0", ":0"}), ScreenSystem::Portal) << type;
    EXPECT_EQ(screenSystemOf({type, "", ":0"}), ScreenSystem::XServer) << type;
    EXPECT_EQ(screenSystemOf({type, "", ""}), ScreenSystem::None) << type;
  }
}

} // namespace
