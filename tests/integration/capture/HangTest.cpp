// A stop ends, whatever hangs: services that are frozen, and a disk that takes nothing.
#include "CaptureRig.h"
#include "support/Movie.h"

#include <thread>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace lumora::testing {

using namespace std::chrono_literals;

class Hang : public CaptureRig {
protected:
  /// Stops from this thread, as nothing is certain to give a sample. The file's end must come within the limit that is
  /// promised; the rest is for a busy machine.
  void stopWithinTheLimit(const std::filesystem::path& name) {
    const HostTime begin = capture().hostTime();
    output_->recordToOutputFileURL(std::nullopt);
    ASSERT_TRUE(delegate_->waitForEnd(name));
    EXPECT_LT(capture().hostTime() - begin, 18'000'000'000U);
    EXPECT_EQ(output_->outputFileURL(), std::nullopt);
  }

  void expectUsable(const std::filesystem::path& name) const {
    const Movie movie(name);
    EXPECT_TRUE(movie.decodes());
    EXPECT_GT(movie.times("v").size(), 20U);
  }
};

TEST_F(Hang, stopEndsWithAUsableFile_whenTheMediaServerIsFrozen) {
  addCameraAndMicrophone();
  run();
  startAtNextPicture(file("a.mov"));
  std::this_thread::sleep_for(1s);
  ASSERT_TRUE(devices_->freeze("pipewire"));
  stopWithinTheLimit(file("a.mov"));
  EXPECT_EQ(delegate_->lastError(), nullptr);
  expectUsable(file("a.mov"));
  session_->stopRunning();
  EXPECT_FALSE(session_->isRunning());
  EXPECT_TRUE(devices_->thaw("pipewire"));
}

TEST_F(Hang, theFileIsFinishedWithAnError_whenTheMediaServerStaysFrozen) {
  addCameraAndMicrophone();
  run();
  startAtNextPicture(file("a.mov"));
  std::this_thread::sleep_for(1s);
  ASSERT_TRUE(devices_->freeze("pipewire"));
  ASSERT_TRUE(delegate_->waitForEnd(file("a.mov")));
  EXPECT_EQ(delegate_->events(file("a.mov")), "did-start will-finish did-finish");
  expectError(CaptureErrorCode::DeviceSilent);
  expectUsable(file("a.mov"));
  EXPECT_TRUE(devices_->thaw("pipewire"));
}

TEST_F(Hang, stopEndsWithAUsableFile_whenTheSoundServerIsFrozen) {
  addCameraAndMicrophone();
  run();
  startAtNextPicture(file("a.mov"));
  std::this_thread::sleep_for(1s);
  ASSERT_TRUE(devices_->freeze("pipewire-pulse"));
  stopWithinTheLimit(file("a.mov"));
  EXPECT_EQ(delegate_->lastError(), nullptr);
  expectUsable(file("a.mov"));
  session_->stopRunning();
  EXPECT_FALSE(session_->isRunning());
  EXPECT_TRUE(devices_->thaw("pipewire-pulse"));
}

TEST_F(Hang, stopEndsWithAUsableFile_whenTheScreenIsFrozen) {
  ASSERT_EQ(session_->addInput(capture().makeScreenInput()), nullptr);
  addDevice("audio:lumora_microphone");
  run();
  startAtNextPicture(file("a.mov"));
  std::this_thread::sleep_for(1500ms);
  ASSERT_TRUE(devices_->freeze("Xvfb"));
  stopWithinTheLimit(file("a.mov"));
  EXPECT_EQ(delegate_->lastError(), nullptr);
  expectUsable(file("a.mov"));
  session_->stopRunning();
  EXPECT_FALSE(session_->isRunning());
  EXPECT_TRUE(devices_->thaw("Xvfb"));
}

/// A file system that hangs: a pipe in the place of the file, which nobody reads.
class HangingDisk : public Hang {
protected:
  void TearDown() override {
    if (reader_ >= 0) {
      ::close(reader_);
    }
    Hang::TearDown();
  }

  std::filesystem::path makePipe() const {
    EXPECT_EQ(::mkfifo(file("a.mov").c_str(), S_IRUSR | S_IWUSR), 0);
    return file("a.mov");
  }

  // Until then the open of the file hangs.
  void letItOpen(const std::filesystem::path& pipe) {
    reader_ = ::open(pipe.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC);
    EXPECT_GE(reader_, 0);
  }

private:
  int reader_ = -1;
};

TEST_F(HangingDisk, stopEndsWithAnError_whenNoWriteReturns) {
  addCameraAndMicrophone();
  run();
  const auto pipe = makePipe();
  letItOpen(pipe);
  output_->setCompressionOptions_forConnection({"mjpeg", {}, {}, {}}, output_->connections()[0]);
  startAtNextPicture(pipe);
  ASSERT_TRUE(delegate_->waitFor("did-start", pipe));
  std::this_thread::sleep_for(2s);
  stopWithinTheLimit(pipe);
  EXPECT_EQ(delegate_->events(pipe), "did-start will-finish did-finish");
  expectError(CaptureErrorCode::FinishTimedOut);
  record(file("b.mov"), 300ms);
}

TEST_F(HangingDisk, stopEndsWithAnError_whenTheFileDoesNotOpen) {
  addCameraAndMicrophone();
  run();
  const auto pipe = makePipe();
  startAtNextPicture(pipe);
  std::this_thread::sleep_for(2s);
  stopWithinTheLimit(pipe);
  EXPECT_EQ(delegate_->events(pipe), "did-finish");
  expectError(CaptureErrorCode::FinishTimedOut);
  letItOpen(pipe);
  record(file("b.mov"), 300ms);
}

} // namespace lumora::testing
