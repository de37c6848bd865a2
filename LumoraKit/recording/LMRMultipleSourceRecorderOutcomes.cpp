// The recorder as its sources' delegate. Messages come on the main thread, one at a time, so nothing here is locked;
// a source has set its own state before it reports.
#include <LumoraKit/platform/Log.h>
#include <LumoraKit/recording/LMRMultipleSourceRecorder.h>
#include <LumoraKit/recording/LMRRemoteVideoRecorder.h>

// In a mix: false while a remote source has another value under the key. Once all have this one, every local source
// that has not is asked to follow.
bool LMRMultipleSourceRecorder::localSourcesFollow(bool value, std::string_view key, const Request& request) const {
  if (!isMixed()) {
    return true;
  }
  const auto sources = sourceRecorders();
  for (const auto& source : sources) {
    if (source->isRemote() && stateOf(*source, key) != value) {
      return false;
    }
  }
  for (const auto& source : sources) {
    if (!source->isRemote() && stateOf(*source, key) != value) {
      request(*source);
    }
  }
  return true;
}

// The local sources start without the delay: the remote ones have waited it out. One that is still starting is asked
// again.
void LMRMultipleSourceRecorder::recorderDidStartRecording(const Recorder&) {
  if (localSourcesFollow(true, "isRecording", [](LMRSourceRecorder& source) { source.startWithDelay(0); }) &&
      sourceRecordersHaveValue_forKey(true, "isRecording") && !isRecording()) {
    didStartRecording();
  }
}

void LMRMultipleSourceRecorder::recorderDidPauseRecording(const Recorder&) {
  if (localSourcesFollow(true, "isPaused", [](LMRSourceRecorder& source) { source.pause(); }) &&
      sourceRecordersHaveValue_forKey(true, "isPaused") && !isPaused()) {
    didPauseRecording();
  }
}

void LMRMultipleSourceRecorder::recorderDidResumeRecording(const Recorder&) {
  if (localSourcesFollow(false, "isPaused", [](LMRSourceRecorder& source) { source.resume(); }) &&
      (sourceRecordersHaveValue_forKey(true, "isRecording") || sourceRecordersHaveValue_forKey(false, "isPaused")) &&
      !isRecording() && isPaused()) {
    didResumeRecording();
  }
}

void LMRMultipleSourceRecorder::recorderDidStopRecording(const Recorder& recorder) {
  logStopOf(*recorder);
  if (sourceRecordersHaveValue_forKey(false, "isRecording") && sourceRecordersHaveValue_forKey(false, "isPaused")) {
    lumora::log("(%@) Successfully stopped all recorders for multi source recording", {className()});
    didStopRecording();
  }
}

void LMRMultipleSourceRecorder::logStopOf(const LMRSourceRecorder& source) const {
  if (source.isRemote()) {
    const auto* const remote = dynamic_cast<const LMRRemoteVideoRecorder*>(&source);
    const auto name = remote ? remote->remoteRecorderName() : std::nullopt;
    lumora::log("(%@) Successfully stopped remote recorder '%@'  for multi source recording",
                {className(), name.value_or("(null)")});
  } else if (!isRecorderTester()) {
    lumora::log("(%@) Successfully stopped local recorder '%@' for multi source recording",
                {className(), source.className()});
  }
}

void LMRMultipleSourceRecorder::recorderDidCancelRecording(const Recorder&) {
  if (sourceRecordersHaveValue_forKey(true, "isCancelled") && !isCancelled()) {
    didCancelRecording();
  }
}

void LMRMultipleSourceRecorder::detachSources() const {
  for (const auto& source : sourceRecorders()) {
    source->setDelegate(nullptr);
  }
}

void LMRMultipleSourceRecorder::recorderFailedToStartRecording_error(const Recorder&, const LMRErrorRef& error) {
  detachSources();
  failedToStartRecordingWithError(error);
}

void LMRMultipleSourceRecorder::recorderFailedToPauseRecording_error(const Recorder&, const LMRErrorRef& error) {
  detachSources();
  failedToPauseRecordingWithError(error);
}

void LMRMultipleSourceRecorder::recorderFailedToResumeRecording_error(const Recorder&, const LMRErrorRef& error) {
  detachSources();
  failedToResumeRecordingWithError(error);
}

void LMRMultipleSourceRecorder::recorderFailedToStopRecording_error(const Recorder&, const LMRErrorRef& error) {
  detachSources();
  failedToStopRecordingWithError(error);
}

void LMRMultipleSourceRecorder::recorderFailedToCancelRecording_error(const Recorder&, const LMRErrorRef& error) {
  detachSources();
  failedToCancelRecordingWithError(error);
}
