#include "CaptureRig.h"
#include "support/Movie.h"

#include <csignal>
#include <thread>

#include <fcntl.h>
#include <sys/mount.h>
#include <unistd.h>

namespace lumora::testing {

using namespace std::chrono_literals;

using Failure = CaptureRig;

TEST_F(Failure, finishesWithAnErrorAndTheSessionGoesOn_whenTheFolderCannotBeWritten) {
  addCameraAndMicrophone();
  run();
  // Nobody, not even root, makes files in /proc.
  const std::filesystem::path folder = ::geteuid() == 0 ? "/proc" : file("locked");
  std::filesystem::create_directories(folder);
  if (::geteuid() != 0) {
    std::filesystem::permissions(folder, std::filesystem::perms::owner_read | std::filesystem::perms::owner_exec);
  }
  startAtNextPicture(folder / "a.mov");
  ASSERT_TRUE(delegate_->waitForEnd(folder / "a.mov"));
  EXPECT_EQ(delegate_->events(folder / "a.mov"), "did-finish");
  expectError(CaptureErrorCode::FileNotWritable);
  EXPECT_NE(delegate_->lastError()->localizedDescription().find("a.mov"), std::string::npos);
  expectGoesOn();
}

TEST_F(Failure, finishesWithAnErrorAndTheSessionGoesOn_whenTheDiskIsFullAtOnce) {
  addCameraAndMicrophone();
  run();
  // Every write to /dev/full fails as on a full disk.
  std::filesystem::create_symlink("/dev/full", file("a.mov"));
  startAtNextPicture(file("a.mov"));
  ASSERT_TRUE(delegate_->waitForEnd(file("a.mov")));
  expectError(CaptureErrorCode::DiskFull);
  expectGoesOn();
}

TEST_F(Failure, leavesAPlayableFile_whenTheDiskFillsUp) {
  addCameraAndMicrophone();
  run();
  const std::filesystem::path folder = file("small");
  std::filesystem::create_directory(folder);
  if (::mount("lumora-test", folder.c_str(), "tmpfs", 0, "size=1500k") != 0) {
    GTEST_SKIP() << "a small file system cannot be mounted here";
  }
  startAtNextPicture(folder / "a.mov");
  const bool ended = delegate_->waitForEnd(folder / "a.mov");
  std::filesystem::copy_file(folder / "a.mov", file("a.mov"));
  ::umount2(folder.c_str(), MNT_DETACH);
  ASSERT_TRUE(ended);
  EXPECT_EQ(delegate_->events(folder / "a.mov"), "did-start will-finish did-finish");
  expectError(CaptureErrorCode::DiskFull);
  EXPECT_GT(Movie(file("a.mov")).times("v").size(), 25U);
  expectGoesOn();
}

TEST_F(Failure, finishesTheFileWithAnError_whenTheCameraDisappears) {
  addCameraAndMicrophone();
  run();
  startAtNextPicture(file("a.mov"));
  std::this_thread::sleep_for(1s);
  ASSERT_TRUE(devices_->remove("lumora_camera"));
  ASSERT_TRUE(delegate_->waitForEnd(file("a.mov")));
  EXPECT_EQ(delegate_->events(file("a.mov")), "did-start will-finish did-finish");
  EXPECT_NE(delegate_->lastError(), nullptr);
  EXPECT_TRUE(Movie(file("a.mov")).decodes());
  EXPECT_GT(Movie(file("a.mov")).times("v").back(), 0.8);

  // The next file says so at once.
  output_->recordToOutputFileURL(file("b.mov"));
  ASSERT_TRUE(delegate_->waitForEnd(file("b.mov")));
  EXPECT_NE(delegate_->lastError(), nullptr);
}

TEST_F(Failure, finishesTheFileWithAnError_whenTheMicrophoneIsRemovedAndAnotherTakesItsPlace) {
  ASSERT_TRUE(devices_->add("microphone", "lumora_other"));
  addCameraAndMicrophone();
  run();
  startAtNextPicture(file("a.mov"));
  std::this_thread::sleep_for(1s);
  ASSERT_TRUE(devices_->remove("lumora_microphone"));
  ASSERT_TRUE(delegate_->waitForEnd(file("a.mov")));
  ASSERT_NE(delegate_->lastError(), nullptr);
  EXPECT_EQ(delegate_->lastError()->domain(), LMRCaptureErrorDomain);
  EXPECT_TRUE(Movie(file("a.mov")).decodes());
}

TEST_F(Failure, finishesTheFileWithAnError_whenTheScreenSessionEnds) {
  ASSERT_EQ(session_->addInput(capture().makeScreenInput()), nullptr);
  addDevice("audio:lumora_microphone");
  run();
  startAtNextPicture(file("a.mov"));
  std::this_thread::sleep_for(1500ms);
  ASSERT_TRUE(devices_->remove("Xvfb"));
  ASSERT_TRUE(delegate_->waitForEnd(file("a.mov")));
  EXPECT_EQ(delegate_->events(file("a.mov")), "did-start will-finish did-finish");
  expectError(CaptureErrorCode::DeviceFailed);
  EXPECT_TRUE(Movie(file("a.mov")).decodes());
  EXPECT_GT(Movie(file("a.mov")).times("v").size(), 20U);
}

TEST_F(Failure, finishesTheFileWithAnError_whenTheSoundServerIsRestarted) {
  addCameraAndMicrophone();
  run();
  startAtNextPicture(file("a.mov"));
  std::this_thread::sleep_for(1s);
  ASSERT_TRUE(devices_->restart("pipewire-pulse"));
  ASSERT_TRUE(delegate_->waitForEnd(file("a.mov")));
  EXPECT_EQ(delegate_->events(file("a.mov")), "did-start will-finish did-finish");
  EXPECT_NE(delegate_->lastError(), nullptr);
  EXPECT_TRUE(Movie(file("a.mov")).decodes());
}

TEST_F(Failure, finishesTheFileWithAnError_whenTheMediaServerDies) {
  addCameraAndMicrophone();
  run();
  startAtNextPicture(file("a.mov"));
  std::this_thread::sleep_for(1s);
  ASSERT_TRUE(devices_->remove("pipewire"));
  ASSERT_TRUE(delegate_->waitForEnd(file("a.mov")));
  EXPECT_EQ(delegate_->events(file("a.mov")), "did-start will-finish did-finish");
  EXPECT_NE(delegate_->lastError(), nullptr);
  EXPECT_TRUE(Movie(file("a.mov")).decodes());
}

TEST_F(Failure, sessionDoesNotStart_whenTheCameraGivesNoSample) {
  ASSERT_TRUE(devices_->add("silent-camera", "lumora_silent"));
  addDevice("video:lumora_silent");
  ASSERT_EQ(session_->addOutput(output_), nullptr);
  const HostTime begin = capture().hostTime();
  const LMRErrorRef error = session_->startRunning();
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->code(), static_cast<std::int64_t>(CaptureErrorCode::DeviceSilent)) << error->description();
  // The limit is part of the contract.
  EXPECT_LT(capture().hostTime() - begin, 6'000'000'000U);
  EXPECT_FALSE(session_->isRunning());
}

TEST_F(Failure, sessionGivesUpAfterFiveSeconds_whenTheCameraHangs) {
  ASSERT_TRUE(devices_->add("stuck-camera", "lumora_stuck"));
  addDevice("video:lumora_stuck");
  const HostTime begin = capture().hostTime();
  const LMRErrorRef error = session_->startRunning();
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->domain(), LMRCaptureErrorDomain);
  EXPECT_LT(capture().hostTime() - begin, 6'000'000'000U);
  EXPECT_FALSE(session_->isRunning());
}

} // namespace lumora::testing
