#include "support/HeadlessDevices.h"
#include "support/Movie.h"
#include "support/TemporaryFolder.h"

#include <LumoraKit/platform/KTRunTask.h>
#include <LumoraKit/platform/Platform.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using lumora::testing::Movie;
using testing::AllOf;
using testing::ContainsRegex;
using testing::HasSubstr;
using testing::IsEmpty;

struct Outcome {
  int status;
  std::string output;
  std::string complaint;
};

Outcome runProgram(const std::string& program, const std::vector<std::string>& arguments) {
  Outcome run{};
  run.status = lumora::Platform::current().toolRunner->run(program, arguments, {}, run.output, run.complaint);
  return run;
}

Outcome runTester(const std::vector<std::string>& arguments) {
  return runProgram(LUMORA_RECORDERTESTER, arguments);
}

// The program with the headless camera, microphone and screen, and a folder for its files.
class RecorderTester : public testing::Test {
protected:
  void SetUp() override {
    std::string reason;
    devices_ = lumora::testing::HeadlessDevices::start(reason);
    if (!devices_) {
      GTEST_SKIP() << reason;
    }
  }

  std::filesystem::path file(const std::string& name) const { return folder_.path() / name; }

  const lumora::tests::TemporaryFolder folder_;
  std::unique_ptr<lumora::testing::HeadlessDevices> devices_;
};

TEST_F(RecorderTester, listsTheDevices_whenAskedTo) {
  const Outcome run = runTester({"--list"});
  EXPECT_EQ(run.status, 0);
  EXPECT_EQ(run.output, "Cameras\n"
                        "   1  Headless camera  video:lumora_camera  (default)\n"
                        "Microphones\n"
                        "   1  Headless microphone  audio:lumora_microphone  (default)\n"
                        "Screen\n"
                        "   the main screen\n");
}

TEST_F(RecorderTester, recordsAndMeasuresAMix_whenCamerasScreenAndMicrophoneAreNamed) {
  ASSERT_TRUE(devices_->add("camera", "lumora_other"));
  const Outcome run =
      runTester({"--camera", "video:lumora_camera+default", "--camera", "video:lumora_other", "--screen",
                 "--microphone", "default", "--seconds", "3", "--pause-at", "1", "--output", folder_.path().string()});
  EXPECT_EQ(run.status, 0) << run.complaint;
  for (const char* const name : {"camera-1.mov", "camera-2.mov", "screen.mov", "microphone-1.mov"}) {
    EXPECT_TRUE(Movie(file(name)).decodes()) << name;
    EXPECT_GT(Movie(file(name)).duration(), 2.5) << name;
    EXPECT_THAT(run.output, HasSubstr(file(name).string()));
  }
  EXPECT_THAT(run.output, ContainsRegex("pictures +[0-9]+ in [0-9.]+ s, [0-9]+ lost"));
  EXPECT_THAT(run.output, ContainsRegex("sound begins -?[0-9.]+ ms after the picture"));
  EXPECT_THAT(run.output, ContainsRegex("camera-2 +start [-+][0-9.]+ ms, after pause 1 [-+][0-9.]+ ms"));
  EXPECT_THAT(run.output, ContainsRegex("microphone-1 +start [-+][0-9.]+ ms, after pause 1 [-+][0-9.]+ ms"));
}

TEST_F(RecorderTester, keepsEarlierFiles_whenTheirNamesAreTaken) {
  for (int i = 0; i < 2; ++i) {
    EXPECT_EQ(runTester({"--screen", "--seconds", "0.5", "--output", folder_.path().string()}).status, 0);
  }
  EXPECT_TRUE(Movie(file("screen.mov")).decodes());
  EXPECT_TRUE(Movie(file("screen-take-2.mov")).decodes());
}

TEST_F(RecorderTester, stopsAndKeepsTheFiles_whenInterrupted) {
  const Outcome run = runProgram(
      "/bin/sh", {"-c",
                  "\"$0\" --camera 1+1 --screen --seconds 600 --output \"$1\" & "
                  "until [ -s \"$1/camera-1.mov\" ] && [ -s \"$1/screen.mov\" ]; do sleep 0.1; kill -0 $! || exit 99; "
                  "done; kill -INT $!; wait $!",
                  LUMORA_RECORDERTESTER, folder_.path().string()});
  EXPECT_EQ(run.status, 0) << run.complaint;
  EXPECT_TRUE(Movie(file("camera-1.mov")).decodes());
  EXPECT_TRUE(Movie(file("screen.mov")).decodes());
  EXPECT_THAT(run.output, HasSubstr("Offsets to camera-1"));
}

TEST_F(RecorderTester, saysWhichDeviceIsMissing_whenOneIsNotThere) {
  const Outcome run = runTester({"--camera", "video:nowhere", "--output", folder_.path().string()});
  EXPECT_EQ(run.status, 1);
  EXPECT_EQ(run.complaint,
            "recordertester: There is no camera \"video:nowhere\" (there is 1, which --list tells of).\n");
}

TEST(RecorderTesterArguments, areRefusedWithAReason_whenTheyAreWrong) {
  const std::pair<std::vector<std::string>, const char*> wrong[] = {
      {{}, "--list, --camera, --microphone or --screen is required"},
      {{"--camera", "1", "--seconds", "soon"}, "--seconds"},
      {{"--camera", "1", "--seconds", "3", "--pause-at", "3"}, "before the end"},
      {{"--screen", "--output", "/does/not/exist"}, "does not exist"},
      {{"--screen-microphone", "1"}, "--screen"},
      {{"--camera"}, "--camera"},
      {{"--sreen"}, "--sreen"},
  };
  for (const auto& [arguments, reason] : wrong) {
    const Outcome run = runTester(arguments);
    EXPECT_EQ(run.status, 2) << reason;
    EXPECT_THAT(run.complaint, HasSubstr(reason));
    EXPECT_THAT(run.output, IsEmpty());
  }
}

TEST(RecorderTesterArguments, areExplained_whenHelpIsAskedFor) {
  const Outcome run = runTester({"--help"});
  EXPECT_EQ(run.status, 0);
  EXPECT_THAT(run.output, AllOf(HasSubstr("--pause-at"), HasSubstr("recordertester --list")));
}

} // namespace
