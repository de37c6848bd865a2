#include "CaptureRig.h"

#include <LumoraKit/platform/Platform.h>

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

bool NotingDelegate::waitFor(const std::string& event, std::size_t count) {
  std::unique_lock lock(mutex_);
  return changed_.wait_for(lock, patienceForEvents, [&] {
    std::size_t seen = 0;
    for (const Told& told : told_) {
      seen += told.event == event ? 1U : 0U;
    }
    return seen >= count;
  });
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

std::size_t NotingDelegate::samples(MediaType type) const {
  const std::lock_guard lock(mutex_);
  return type == MediaType::Video ? pictures_ : sounds_;
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
    ++(connection.mediaType() == MediaType::Video ? pictures_ : sounds_);
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
  return delegate_->atNext(MediaType::Video, [&](MovieFileOutput& output) { output.recordToOutputFileURL(file); });
}

void CaptureRig::stopAtNextPicture() {
  delegate_->atNext(MediaType::Video, [](MovieFileOutput& output) { output.recordToOutputFileURL(std::nullopt); });
}

HostTime CaptureRig::record(const std::filesystem::path& file, std::chrono::milliseconds time) {
  const std::size_t before = delegate_->told().size();
  const HostTime start = startAtNextPicture(file);
  std::this_thread::sleep_for(time);
  stopAtNextPicture();
  static_cast<void>(before);
  delegate_->waitFor("did-finish");
  return start;
}

} // namespace lumora::testing
