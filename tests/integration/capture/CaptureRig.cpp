#include "CaptureRig.h"

#include "support/Movie.h"

#include <LumoraKit/platform/Platform.h>

#include <algorithm>
#include <cstdlib>
#include <thread>

namespace lumora::testing {
namespace {

constexpr std::chrono::seconds patienceForSamples{10};
constexpr std::chrono::seconds patienceForEvents{20};

} // namespace

HostTime NotingDelegate::atNext(MediaType type, Action action) {
  std::unique_lock lock(mutex_);
  wanted_ = type;
  actedAt_ = 0;
  action_ = std::move(action);
  changed_.wait_for(lock, patienceForSamples, [this] { return actedAt_ != 0; });
  action_ = nullptr;
  return actedAt_;
}

bool NotingDelegate::waitFor(const std::string& event, const std::filesystem::path& file) {
  std::unique_lock lock(mutex_);
  return changed_.wait_for(lock, patienceForEvents, [&] {
    return std::ranges::any_of(told_, [&](const Told& told) { return told.event == event && told.file == file; });
  });
}

bool NotingDelegate::waitForEnd(const std::filesystem::path& file) {
  return waitFor("did-finish", file);
}

std::vector<Told> NotingDelegate::told() const {
  const std::lock_guard lock(mutex_);
  return told_;
}

std::string NotingDelegate::events(const std::filesystem::path& file) const {
  std::string result;
  for (const Told& told : told()) {
    if (told.file == file) {
      result += (result.empty() ? "" : " ") + told.event;
    }
  }
  return result;
}

LMRErrorRef NotingDelegate::lastError() const {
  const std::lock_guard lock(mutex_);
  return told_.empty() ? nullptr : told_.back().error;
}

std::vector<HostTime> NotingDelegate::pictures() const {
  const std::lock_guard lock(mutex_);
  return pictures_;
}

void NotingDelegate::note(const std::string& event, const std::filesystem::path& file, const LMRErrorRef& error) {
  {
    const std::lock_guard lock(mutex_);
    told_.push_back({event, file, error});
  }
  changed_.notify_all();
}

void NotingDelegate::captureOutput_didStartRecordingToOutputFileAtURL_forConnections(const Output&,
                                                                                     const std::filesystem::path& file,
                                                                                     const Connections&) {
  note("did-start", file, nullptr);
}

void NotingDelegate::captureOutput_didPauseRecordingToOutputFileAtURL_forConnections(const Output&,
                                                                                     const std::filesystem::path& file,
                                                                                     const Connections&) {
  note("did-pause", file, nullptr);
}

void NotingDelegate::captureOutput_didResumeRecordingToOutputFileAtURL_forConnections(const Output&,
                                                                                      const std::filesystem::path& file,
                                                                                      const Connections&) {
  note("did-resume", file, nullptr);
}

void NotingDelegate::captureOutput_willFinishRecordingToOutputFileAtURL_forConnections_dueToError(
    const Output&, const std::filesystem::path& file, const Connections&, const LMRErrorRef& error) {
  note("will-finish", file, error);
}

void NotingDelegate::captureOutput_didFinishRecordingToOutputFileAtURL_forConnections_dueToError(
    const Output&, const std::filesystem::path& file, const Connections&, const LMRErrorRef& error) {
  note("did-finish", file, error);
}

void NotingDelegate::captureOutput_didOutputSampleBuffer_fromConnection(MovieFileOutput& output,
                                                                        const SampleBuffer& sampleBuffer,
                                                                        CaptureConnection& connection) {
  Action action;
  {
    const std::lock_guard lock(mutex_);
    if (connection.mediaType() == MediaType::Video) {
      pictures_.push_back(sampleBuffer.hostTime().value_or(0));
    }
    if (connection.mediaType() == wanted_) {
      std::swap(action, action_);
    }
  }
  if (action) {
    action(output);
    const std::lock_guard lock(mutex_);
    actedAt_ = sampleBuffer.hostTime().value_or(0);
    changed_.notify_all();
  }
}

void CaptureRig::SetUp() {
  std::string reason;
  devices_ = HeadlessDevices::start(reason);
  if (!devices_) {
    GTEST_SKIP() << reason;
  }
  std::string name = ::testing::TempDir() + "lumora-capture-XXXXXX";
  folder_ = ::mkdtemp(name.data());
  session_ = capture().makeSession();
  output_ = capture().makeMovieFileOutput();
  output_->setDelegate(delegate_);
}

void CaptureRig::TearDown() {
  if (session_) {
    session_->stopRunning();
  }
  std::filesystem::remove_all(folder_);
}

MediaCapture& CaptureRig::capture() const {
  return *Platform::current().mediaCapture;
}

void CaptureRig::addDevice(const std::string& uniqueID) {
  const auto device = capture().deviceWithUniqueID(uniqueID);
  ASSERT_NE(device, nullptr) << uniqueID;
  const LMRErrorRef openError = device->open();
  ASSERT_EQ(openError, nullptr) << openError->description();
  ASSERT_EQ(session_->addInput(capture().makeDeviceInput(device)), nullptr);
}

void CaptureRig::addCameraAndMicrophone() {
  addDevice("video:lumora_camera");
  addDevice("audio:lumora_microphone");
}

void CaptureRig::run() {
  ASSERT_EQ(session_->addOutput(output_), nullptr);
  const LMRErrorRef error = session_->startRunning();
  ASSERT_EQ(error, nullptr) << error->description();
}

HostTime CaptureRig::startAtNextPicture(const std::filesystem::path& file) {
  return delegate_->atNext(MediaType::Video, [file](MovieFileOutput& output) { output.recordToOutputFileURL(file); });
}

HostTime CaptureRig::pauseAtNextPicture() {
  return delegate_->atNext(MediaType::Video, [](MovieFileOutput& output) { output.pauseRecording(); });
}

HostTime CaptureRig::resumeAtNextPicture() {
  return delegate_->atNext(MediaType::Video, [](MovieFileOutput& output) { output.resumeRecording(); });
}

HostTime CaptureRig::stopAtNextPicture() {
  return delegate_->atNext(MediaType::Video,
                           [](MovieFileOutput& output) { output.recordToOutputFileURL(std::nullopt); });
}

void CaptureRig::record(const std::filesystem::path& file, std::chrono::milliseconds time) {
  startAtNextPicture(file);
  std::this_thread::sleep_for(time);
  stopAtNextPicture();
  ASSERT_TRUE(delegate_->waitForEnd(file));
  const LMRErrorRef error = delegate_->lastError();
  ASSERT_EQ(error, nullptr) << error->description();
}

void CaptureRig::expectError(CaptureErrorCode code) {
  const LMRErrorRef error = delegate_->lastError();
  ASSERT_NE(error, nullptr);
  EXPECT_EQ(error->domain(), LMRCaptureErrorDomain);
  EXPECT_EQ(error->code(), static_cast<std::int64_t>(code)) << error->description();
}

void CaptureRig::expectGoesOn() {
  EXPECT_TRUE(session_->isRunning());
  record(file("next.mov"), std::chrono::milliseconds(300));
  EXPECT_TRUE(Movie(file("next.mov")).decodes());
}

} // namespace lumora::testing
