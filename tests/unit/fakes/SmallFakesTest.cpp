#include <LumoraKit/testing/FakePlatform.h>

#include <gmock/gmock.h>

namespace lumora::tests {
namespace {

using namespace std::chrono_literals;

TEST(FakeWallClock, standsStill_untilMoved) {
  fakes::FakeWallClock clock;
  const WallTime start = clock.now();
  EXPECT_EQ(Value(std::chrono::floor<std::chrono::seconds>(start)).description(), "2010-01-20 15:04:05 +0000");
  EXPECT_EQ(clock.now(), start);
  clock.advance(1500ms);
  EXPECT_EQ(clock.now() - start, 1500ms);
  clock.set(start);
  EXPECT_EQ(clock.now(), start);
}

TEST(RecordingLog, keepsLinesInOrder) {
  fakes::RecordingLog log;
  log.write("first line");
  log.write("second line");
  EXPECT_THAT(log.lines(), testing::ElementsAre("first line", "second line"));
  EXPECT_EQ(log.count("line"), 2U);
  EXPECT_TRUE(log.contains("second"));
  EXPECT_FALSE(log.contains("third"));
  log.clear();
  EXPECT_THAT(log.lines(), testing::IsEmpty());
}

TEST(FakeApplication, isWhoTheTestSays) {
  fakes::FakeApplication application;
  EXPECT_EQ(application.identifier(), "org.vantor.lumora.test");
  application.setIdentifier("org.example.recorder");
  application.setLanguage("ja");
  EXPECT_EQ(application.identifier(), "org.example.recorder");
  EXPECT_EQ(application.language(), "ja");
}

TEST(FakePlatform, isInstalled_whileItLives) {
  const auto before = Platform::current().log;
  {
    const fakes::FakePlatform platform;
    EXPECT_EQ(Platform::current().log, platform.log);
    EXPECT_EQ(Platform::current().files, platform.files);
    EXPECT_EQ(Platform::current().preferences, platform.preferences);
    EXPECT_EQ(Platform::current().mediaCapture, platform.mediaCapture);
  }
  EXPECT_EQ(Platform::current().log, before);
}

TEST(FakePlatform, installsReplacedMember) {
  fakes::FakePlatform platform;
  platform.log = std::make_shared<fakes::RecordingLog>();
  EXPECT_NE(Platform::current().log, platform.log);
  platform.install();
  EXPECT_EQ(Platform::current().log, platform.log);
}

} // namespace
} // namespace lumora::tests
