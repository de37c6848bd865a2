// Many short recordings in one process, through the real pipelines.
#include "support/Descriptors.h"
#include "support/HeadlessDevices.h"
#include "support/TemporaryFolder.h"

#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/MediaCapture.h>
#include <LumoraKit/platform/Platform.h>

#include <gtest/gtest.h>

#include <chrono>
#include <condition_variable>
#include <iostream>
#include <mutex>
#include <thread>
#include <vector>

#include <malloc.h>

namespace {

using namespace std::chrono_literals;

// A sanitizer makes each several times slower: a tenth of them then.
constexpr int recordings = 500;
constexpr int recordingsWithASanitizer = 50;
constexpr int lanes = 2;
// The first ones also load plug-ins, try encoders and fill caches.
constexpr int warmUp = 40;

// GStreamer's muxer keeps about 4 KiB a fragment; a pipeline that was kept would be some hundreds.
constexpr std::size_t bytesARecording = 8 * 1024;
// What the allocator holds back for its many threads grows at first and then stays.
constexpr std::size_t bytesHeldBack = 64 * 1024 * 1024;

// What the program has allocated. Resident memory also counts what it has freed.
std::size_t allocatedMemory() {
  const auto info = ::mallinfo2();
  return info.uordblks + info.hblkhd;
}

std::size_t growth(std::size_t before, std::size_t now) {
  return now > before ? now - before : 0;
}

// Begins a file at the first picture that it is shown, ends it some pictures later, and waits for the file's end.
class Take final : public lumora::MovieFileOutputDelegate {
public:
  explicit Take(std::filesystem::path file) : file_(std::move(file)) {}

  /// Whether the file was finished well.
  bool wait() {
    std::unique_lock lock(mutex_);
    return changed_.wait_for(lock, 30s, [this] { return ended_; }) && !error_;
  }

  using Output = std::shared_ptr<lumora::MovieFileOutput>;
  using Path = std::filesystem::path;

  void captureOutput_didStartRecordingToOutputFileAtURL_forConnections(const Output&, const Path&,
                                                                       const Connections&) override {}
  void captureOutput_didPauseRecordingToOutputFileAtURL_forConnections(const Output&, const Path&,
                                                                       const Connections&) override {}
  void captureOutput_didResumeRecordingToOutputFileAtURL_forConnections(const Output&, const Path&,
                                                                        const Connections&) override {}
  void captureOutput_willFinishRecordingToOutputFileAtURL_forConnections_dueToError(const Output&, const Path&,
                                                                                    const Connections&,
                                                                                    const LMRErrorRef&) override {}
  void captureOutput_didFinishRecordingToOutputFileAtURL_forConnections_dueToError(const Output&, const Path&,
                                                                                   const Connections&,
                                                                                   const LMRErrorRef& error) override {
    const std::lock_guard lock(mutex_);
    ended_ = true;
    error_ = error;
    changed_.notify_all();
  }
  void captureOutput_didOutputSampleBuffer_fromConnection(lumora::MovieFileOutput& output, const lumora::SampleBuffer&,
                                                          lumora::CaptureConnection& connection) override {
    constexpr int length = 4;
    if (connection.mediaType() != lumora::MediaType::Video) {
      return;
    }
    if (pictures_ == 0) {
      output.recordToOutputFileURL(file_);
    } else if (pictures_ == length) {
      output.recordToOutputFileURL(std::nullopt);
    }
    ++pictures_;
  }

private:
  const std::filesystem::path file_;
  // Pictures come on one thread.
  int pictures_ = 0;
  std::mutex mutex_;
  std::condition_variable changed_;
  bool ended_ = false;
  LMRErrorRef error_;
};

class ManyRecordings : public testing::Test {
protected:
  void SetUp() override {
    std::string reason;
    devices_ = lumora::testing::HeadlessDevices::start(reason);
    if (!devices_) {
      GTEST_SKIP() << reason;
    }
    session_ = capture().makeSession();
    for (const char* const name : {"video:lumora_camera", "audio:lumora_microphone"}) {
      const auto device = capture().deviceWithUniqueID(name);
      ASSERT_NE(device, nullptr) << name;
      ASSERT_EQ(device->open(), nullptr);
      ASSERT_EQ(session_->addInput(capture().makeDeviceInput(device)), nullptr);
    }
    const auto error = session_->startRunning();
    ASSERT_EQ(error, nullptr) << lumora::text(error);
  }

  void TearDown() override {
    if (session_) {
      session_->stopRunning();
    }
  }

  static lumora::MediaCapture& capture() { return *lumora::Platform::current().mediaCapture; }

  // Like a recorder: an output of its own, in the session for one file.
  bool recordOne(const std::filesystem::path& file) const {
    const auto output = capture().makeMovieFileOutput();
    const auto take = std::make_shared<Take>(file);
    output->setDelegate(take);
    if (session_->addOutput(output)) {
      return false;
    }
    output->setCompressionOptions_forConnection({{}, {}, 320, 180}, output->connections()[0]);
    const bool isGood = take->wait();
    session_->removeOutput(output);
    const bool isThere = std::filesystem::file_size(file) > 0;
    std::filesystem::remove(file);
    return isGood && isThere;
  }

  void record(int count) const {
    std::vector<std::thread> threads;
    for (int lane = 0; lane < lanes; ++lane) {
      threads.emplace_back([this, lane, count] {
        for (int i = 0; i < count / lanes; ++i) {
          EXPECT_TRUE(recordOne(folder_ / (std::to_string(lane) + ".mov"))) << i;
        }
      });
    }
    for (auto& thread : threads) {
      thread.join();
    }
  }

  // Workers that have nothing to do end after a while.
  static std::size_t settledThreads(std::size_t limit) {
    const auto end = std::chrono::steady_clock::now() + 30s;
    while (lumora::tests::threadCount() > limit && std::chrono::steady_clock::now() < end) {
      std::this_thread::sleep_for(50ms);
    }
    return lumora::tests::threadCount();
  }

  const lumora::tests::TemporaryFolder folder_;
  std::unique_ptr<lumora::testing::HeadlessDevices> devices_;
  std::shared_ptr<lumora::CaptureSession> session_;
};

TEST_F(ManyRecordings, leaveDescriptorsThreadsAndMemoryAsTheyWere) {
  const auto threadsBefore = lumora::tests::threadCount();
  record(warmUp);
  const auto descriptors = lumora::tests::openDescriptors();
  const auto allocated = allocatedMemory();
  const auto resident = lumora::tests::residentMemory();
  const int count = lumora::tests::memoryCanBeMeasured() ? recordings : recordingsWithASanitizer;
  record(count);
  EXPECT_LE(lumora::tests::openDescriptors(), descriptors);
  EXPECT_LE(settledThreads(threadsBefore), threadsBefore);
  const auto moreAllocated = growth(allocated, allocatedMemory());
  const auto moreResident = growth(resident, lumora::tests::residentMemory());
  std::cout << count << " recordings: " << moreAllocated / 1024 << " KiB more allocated, " << moreResident / 1024
            << " KiB more resident\n";
  if (lumora::tests::memoryCanBeMeasured()) {
    EXPECT_LT(moreAllocated, static_cast<std::size_t>(count) * bytesARecording);
    EXPECT_LT(moreResident, bytesHeldBack);
  }
}

} // namespace
