#include "recorder/model/LocalSource.h"

#include "recorder/model/CaptureQueue.h"
#include "recorder/model/Texts.h"

#include <utility>

namespace recorder {
namespace {

constexpr lumora::HostTime second = 1'000'000'000;

lumora::HostTime now() {
  return lumora::Platform::current().mediaCapture->hostTime();
}

bool waitsForTheUser(const LMRErrorRef& error) {
  return error && error->domain() == LMRCaptureErrorDomain &&
         error->code() == static_cast<std::int64_t>(lumora::CaptureErrorCode::ScreenNotAllowedYet);
}

LMRErrorRef nothingComes(const std::string& name) {
  return LMRError::make(LMRRecorderErrorDomain, 1, filled("Nothing comes from %1", {name}));
}

} // namespace

void LocalSource::Waiting::note(bool hasCome) {
  if (hasCome) {
    since_ = 0;
  } else if (since_ == 0) {
    since_ = now();
  }
}

bool LocalSource::Waiting::isTooLong() const {
  return since_ != 0 && now() - since_ > patience * second;
}

LocalSource::LocalSource(PlannedSource plan, std::optional<lumora::CompressionOptions> videoCompression)
    : Source(std::move(plan)), videoCompression_(std::move(videoCompression)) {}

// Devices take their time to stop.
LocalSource::~LocalSource() {
  captureQueue()->async([session = std::move(session_), recorder = std::move(recorder_),
                         meter = std::shared_ptr<LMRLevelMeter>(std::move(meter_)),
                         preview = std::shared_ptr<LMRVideoPreview>(std::move(preview_))]() mutable {
    meter.reset();
    preview.reset();
    recorder.reset();
    if (session) {
      session->stopRunning();
    }
  });
}

void LocalSource::open() {
  setError(nullptr);
  start(nullptr);
}

// With the session of an earlier try, which waits for the user's answer.
void LocalSource::start(const std::shared_ptr<lumora::CaptureSession>& session) {
  captureQueue()->async([weak = weak_from_this(), plan = plan(), begun = session] {
    LMRErrorRef error;
    auto running = begun ? begun : makeSession(plan, &error);
    if (running) {
      error = running->startRunning();
    }
    lumora::Platform::current().queues->mainQueue()->async([weak, running, error] {
      if (const auto self = std::static_pointer_cast<LocalSource>(weak.lock())) {
        self->opened(running, error);
      }
    });
  });
}

void LocalSource::opened(const std::shared_ptr<lumora::CaptureSession>& session, const LMRErrorRef& error) {
  isAskingUser_ = waitsForTheUser(error);
  if (isAskingUser_) {
    start(session);
  } else if (error) {
    setError(error);
  } else {
    session_ = session;
    joinSession();
  }
  changed.notify();
}

void LocalSource::joinSession() {
  LMRErrorRef error;
  if (hasSound()) {
    meter_ = LMRLevelMeter::meterWithCaptureSession_error(session_, &error);
  }
  if (plan().source.hasPicture()) {
    preview_ = LMRVideoPreview::previewWithCaptureSession_error(session_, &error);
  }
  setError(error);
  recorder_ = makeRecorder();
}

std::shared_ptr<LMRLocalVideoRecorder> LocalSource::makeRecorder() const {
  std::shared_ptr<LMRLocalVideoRecorder> recorder;
  switch (plan().source.kind) {
  case SourceKind::Screen:
    recorder = LMRLocalScreenRecorder::recorderWithCaptureSession(session_);
    break;
  case SourceKind::Microphone:
    recorder = LMRLocalAudioRecorder::recorderWithCaptureSession(session_);
    break;
  default:
    recorder = LMRLocalVideoRecorder::recorderWithCaptureSession(session_);
  }
  recorder->setVideoCompressionOptions(videoCompression_);
  return recorder;
}

// The session goes on: without it the old recorder stops nothing when it dies.
void LocalSource::renewRecorder() {
  if (recorder_) {
    session_->removeOutput(recorder_->movieFileOutput());
    recorder_->setCaptureSession(nullptr);
    recorder_ = makeRecorder();
  }
}

void LocalSource::look(std::optional<std::pair<std::uint32_t, std::uint32_t>> size) {
  if (meter_) {
    auto levels = meter_->takeLevels();
    soundWaiting_.note(!levels.empty());
    levels_ = std::move(levels);
  }
  if (preview_ && size) {
    auto picture = preview_->takePicture(size->first, size->second);
    pictureWaiting_.note(picture.has_value());
    picture_ = picture ? std::move(picture) : std::move(picture_);
  } else {
    pictureWaiting_.forget();
  }
  if (!error() && (soundWaiting_.isTooLong() || pictureWaiting_.isTooLong())) {
    fail(nothingComes(plan().source.name));
  }
}

bool LocalSource::hasSound() const {
  return plan().source.kind == SourceKind::Microphone || !plan().microphone.empty();
}

bool LocalSource::isSilent() const {
  return meter_ && !error() && meter_->secondsOfSilence() > silence;
}

} // namespace recorder
