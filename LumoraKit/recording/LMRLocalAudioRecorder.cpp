#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/Queues.h>
#include <LumoraKit/recording/LMRCaptureSessionAdditions.h>
#include <LumoraKit/recording/LMRLocalAudioRecorder.h>

#include <chrono>

namespace {

lumora::HostTime hostTime() {
  return lumora::Platform::current().mediaCapture->hostTime();
}

} // namespace

std::shared_ptr<LMRLocalAudioRecorder>
LMRLocalAudioRecorder::recorderWithCaptureSession(const std::shared_ptr<lumora::CaptureSession>& captureSession) {
  return makeWithCaptureSession<LMRLocalAudioRecorder>(captureSession);
}

std::shared_ptr<LMRLocalAudioRecorder> LMRLocalAudioRecorder::initWithCoder(const lumora::KeyedUnarchiver& coder) {
  return makeWithCoder<LMRLocalAudioRecorder>(coder);
}

LMRLocalAudioRecorder::LMRLocalAudioRecorder(MadeByFactory key) : LMRLocalVideoRecorder(key) {}

LMRLocalAudioRecorder::~LMRLocalAudioRecorder() = default;

std::string LMRLocalAudioRecorder::className() const {
  return "LMRLocalAudioRecorder";
}

// The delay is ignored, as by every local recorder.
void LMRLocalAudioRecorder::startWithDelay(double) {
  setIsStarting(true);
  const auto& queues = lumora::Platform::current().queues;
  const auto callersQueue = queues->currentQueue();
  const auto self = std::static_pointer_cast<LMRLocalAudioRecorder>(shared_from_this());
  queues->runAfter(std::chrono::nanoseconds::zero(), callersQueue ? callersQueue : queues->concurrentQueue(),
                   [self] { self->beginFileNow(); });
}

void LMRLocalAudioRecorder::beginFileNow() {
  const auto file = outputFileURL();
  lumora::log("Recording new podcast episode at %@", {file ? lumora::text(*file) : "(null)"});
  beginFile(hostTime());
}

void LMRLocalAudioRecorder::pause() {
  pauseFile(hostTime());
}

void LMRLocalAudioRecorder::resume() {
  resumeFile(hostTime());
}

bool LMRLocalAudioRecorder::decodeWithCoder(const lumora::KeyedUnarchiver& coder) {
  return LMRLocalVideoRecorder::decodeWithCoder(coder) &&
         rebuildSession(coder, LMRCaptureSessionAdditions::captureSessionWithAudioDevice_error);
}
