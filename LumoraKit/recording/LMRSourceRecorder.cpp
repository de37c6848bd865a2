#include <LumoraKit/platform/Assert.h>
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/recording/LMRSourceRecorder.h>

#include <chrono>
#include <typeinfo>

namespace {

lumora::WallTime now() {
  return lumora::Platform::current().wallClock->now();
}

double secondsSince(lumora::WallTime start) {
  return std::chrono::duration<double>(now() - start).count();
}

} // namespace

LMRSourceRecorder::LMRSourceRecorder() = default;
LMRSourceRecorder::~LMRSourceRecorder() = default;

std::string LMRSourceRecorder::className() const {
  return "LMRSourceRecorder";
}

bool LMRSourceRecorder::isRemote() const {
  return false;
}

void LMRSourceRecorder::bootstrap() {}

void LMRSourceRecorder::start() {
  startWithDelay(0.0);
}

// A subclass that leaves a request out gets the log line; only this class itself is refused.
void LMRSourceRecorder::request(std::string_view operation, std::string_view line) const {
  lumora::assertThat(typeid(*this) != typeid(LMRSourceRecorder), "![self isMemberOfClass:[LMRSourceRecorder class]]",
                     operation, "LMRSourceRecorder");
  lumora::log(line, {className()});
}

void LMRSourceRecorder::startWithDelay(double) {
  request("startWithDelay:", "%@ starting...");
}

void LMRSourceRecorder::pause() {
  request("pause", "%@ pausing...");
}

void LMRSourceRecorder::resume() {
  request("resume", "%@ resuming...");
}

void LMRSourceRecorder::stop() {
  request("stop", "%@ stopping...");
}

void LMRSourceRecorder::cancel() {
  request("cancel", "%@ cancelling...");
}

void LMRSourceRecorder::didStartRecording() {
  lumora::log("%@ successfully started recording", {className()});
  setIsStarting(false);
  setIsRecording(true);
  setIsPaused(false);
  updateMostRecentStartDate();
  notifyDelegate(LMRDelegateMessage::recorderDidStartRecording);
}

void LMRSourceRecorder::failedToStartRecordingWithError(const LMRErrorRef& error) {
  lumora::log("%@ failed to start recording: %@", {className(), lumora::text(error)});
  setIsStarting(false);
  notifyDelegate(LMRDelegateMessage::recorderFailedToStartRecording_error, error);
}

void LMRSourceRecorder::didPauseRecording() {
  lumora::log("%@ successfully paused recording", {className()});
  setIsRecording(false);
  setIsPaused(true);
  updateElapsedRecordingTime();
  notifyDelegate(LMRDelegateMessage::recorderDidPauseRecording);
}

void LMRSourceRecorder::failedToPauseRecordingWithError(const LMRErrorRef& error) {
  lumora::log("%@ failed to pause recording: %@", {className(), lumora::text(error)});
  notifyDelegate(LMRDelegateMessage::recorderFailedToPauseRecording_error, error);
}

void LMRSourceRecorder::didResumeRecording() {
  lumora::log("%@ successfully resumed recording", {className()});
  setIsRecording(true);
  setIsPaused(false);
  updateMostRecentStartDate();
  notifyDelegate(LMRDelegateMessage::recorderDidResumeRecording);
}

void LMRSourceRecorder::failedToResumeRecordingWithError(const LMRErrorRef& error) {
  lumora::log("%@ failed to resume recording: %@", {className(), lumora::text(error)});
  notifyDelegate(LMRDelegateMessage::recorderFailedToResumeRecording_error, error);
}

void LMRSourceRecorder::didStopRecording() {
  lumora::log("%@ successfully stopped recording", {className()});
  setIsRecording(false);
  setIsPaused(false);
  updateElapsedRecordingTime();
  notifyDelegate(LMRDelegateMessage::recorderDidStopRecording);
}

void LMRSourceRecorder::failedToStopRecordingWithError(const LMRErrorRef& error) {
  lumora::log("%@ failed to stop recording: %@", {className(), lumora::text(error)});
  notifyDelegate(LMRDelegateMessage::recorderFailedToStopRecording_error, error);
}

void LMRSourceRecorder::didCancelRecording() {
  lumora::log("%@ successfully cancelled recording", {className()});
  setIsRecording(false);
  setIsPaused(false);
  setIsCancelled(true);
  updateElapsedRecordingTime();
  notifyDelegate(LMRDelegateMessage::recorderDidCancelRecording);
}

void LMRSourceRecorder::failedToCancelRecordingWithError(const LMRErrorRef& error) {
  lumora::log("%@ failed to cancel recording: %@", {className(), lumora::text(error)});
  notifyDelegate(LMRDelegateMessage::recorderFailedToCancelRecording_error, error);
}

double LMRSourceRecorder::elapsedRecordingTime() const {
  const std::lock_guard lock(clockMutex_);
  const auto& start = clock_.mostRecentStartDate;
  return clock_.elapsedRecordingTime + (start ? secondsSince(*start) : 0);
}

void LMRSourceRecorder::setElapsedRecordingTime(double seconds) {
  const std::lock_guard lock(clockMutex_);
  clock_.elapsedRecordingTime = seconds;
}

std::optional<lumora::WallTime> LMRSourceRecorder::mostRecentStartDate() const {
  const std::lock_guard lock(clockMutex_);
  return clock_.mostRecentStartDate;
}

void LMRSourceRecorder::updateMostRecentStartDate() {
  const std::lock_guard lock(clockMutex_);
  clock_.mostRecentStartDate = now();
}

void LMRSourceRecorder::updateElapsedRecordingTime() {
  const std::lock_guard lock(clockMutex_);
  if (clock_.mostRecentStartDate) {
    clock_.elapsedRecordingTime += secondsSince(*clock_.mostRecentStartDate);
    clock_.mostRecentStartDate.reset();
  }
}
