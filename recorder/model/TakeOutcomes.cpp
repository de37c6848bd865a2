// The take as its recorder's delegate and, once a source has failed, as that of each source.
#include "recorder/model/Take.h"
#include "recorder/model/Texts.h"

#include <algorithm>

namespace recorder {

void Take::recorderDidStartRecording(const Recorder&) {
  if (state_ == TakeState::Starting) {
    setState(TakeState::Recording);
  }
}

// What has begun is thrown away.
void Take::recorderFailedToStartRecording_error(const Recorder&, const LMRErrorRef& error) {
  if (state_ == TakeState::Ready || state_ == TakeState::Starting) {
    requestFailed(error);
    abandon(TakeState::Failed);
  }
}

void Take::recorderDidPauseRecording(const Recorder&) {
  settle();
}

void Take::recorderFailedToPauseRecording_error(const Recorder&, const LMRErrorRef& error) {
  requestFailed(error);
  setState(TakeState::Recording);
}

void Take::recorderDidResumeRecording(const Recorder&) {
  settle();
}

void Take::recorderFailedToResumeRecording_error(const Recorder&, const LMRErrorRef& error) {
  requestFailed(error);
  setState(TakeState::Paused);
}

void Take::recorderDidStopRecording(const Recorder& recorder) {
  ended_.insert(recorder.get());
  settle();
}

// Three things are told so: the server has no place for the recording; a source was lost, in the middle or at the end;
// and, by a lost source, that there is nothing to stop.
void Take::recorderFailedToStopRecording_error(const Recorder& recorder, const LMRErrorRef& error) {
  if (isWhole(recorder) && state_ == TakeState::Stopping && !hasPlaceAtServer()) {
    problem_ = error;
    hasNoPlaceAtServer_ = true;
    const bool isPaused = std::ranges::any_of(recorders_, [](const auto& each) { return each->isPaused(); });
    setState(isPaused ? TakeState::Paused : TakeState::Recording);
    return;
  }
  if (state_ == TakeState::Starting) {
    recorderFailedToStartRecording_error(recorder, error);
    return;
  }
  ended_.insert(recorder.get());
  requestFailed(error);
  if (isWhole(recorder) && state_ == TakeState::Stopping) {
    stopRemoteSourcesAgain();
  }
  settle();
  changed.notify();
}

// The combined recorder does not say whose stop has failed. A camera of the server that did not stop may be asked
// again.
void Take::stopRemoteSourcesAgain() {
  for (const auto& source : recorders_) {
    if (source->isRemote() && isLive(source)) {
      queue_->async([source] { source->stop(); });
    }
  }
}

void Take::recorderDidCancelRecording(const Recorder& recorder) {
  ended_.insert(recorder.get());
  settle();
}

void Take::recorderFailedToCancelRecording_error(const Recorder& recorder, const LMRErrorRef& error) {
  ended_.insert(recorder.get());
  requestFailed(error);
  settle();
}

// What the states of the sources together say.
void Take::settle() {
  if (isAbandoned_) {
    return;
  }
  const bool isOver = ended_.contains(recorder_.get()) && !listensToEach_;
  if (state_ == TakeState::Stopping) {
    if (isOver || (nothingRecords() && (hasPlaceAtServer() || isWithoutServer_))) {
      setState(TakeState::Stopped);
    }
  } else if (state_ == TakeState::Cancelling) {
    if (isOver || nothingRecords()) {
      removeFilesOfLostSources();
      setState(TakeState::Cancelled);
    }
  } else if (state_ == TakeState::Pausing || state_ == TakeState::Resuming) {
    const bool wanted = state_ == TakeState::Pausing;
    if (std::ranges::all_of(recorders_,
                            [&](const auto& each) { return !isLive(each) || each->isPaused() == wanted; })) {
      setState(wanted ? TakeState::Paused : TakeState::Recording);
    }
  }
}

// The places are handed out before anything is stopped.
bool Take::hasPlaceAtServer() const {
  return std::ranges::any_of(recorders_, [](const auto& each) {
    const auto local = std::dynamic_pointer_cast<LMRLocalVideoRecorder>(each);
    const auto remote = std::dynamic_pointer_cast<LMRRemoteVideoRecorder>(each);
    return (local && local->submissionUUID()) || (remote && remote->submissionUUID());
  });
}

// It says that it records, and writes no file.
bool Take::isLost(const LMRSourceRecorder& source) const {
  const auto* const local = dynamic_cast<const LMRLocalVideoRecorder*>(&source);
  return local && (source.isRecording() || source.isPaused()) && !local->movieFileOutput()->outputFileURL();
}

bool Take::isLive(const Recorder& source) const {
  return (source->isRecording() || source->isPaused()) && !ended_.contains(source.get()) && !isLost(*source);
}

bool Take::nothingRecords() const {
  return std::ranges::none_of(recorders_, [this](const auto& each) { return isLive(each); });
}

// The others removed theirs.
void Take::removeFilesOfLostSources() const {
  for (const auto& source : recorders_) {
    if (isLost(*source)) {
      const auto file = std::static_pointer_cast<LMRLocalVideoRecorder>(source)->outputFileURL();
      lumora::Platform::current().files->removeFile(*file);
    }
  }
}

void Take::markLostSources(const LMRErrorRef& error) {
  for (std::size_t i = 0; i < sources_.size(); ++i) {
    if (isLost(*recorders_[i]) && !sources_[i]->error()) {
      sources_[i]->fail(error ? error : LMRError::make(LMRRecorderErrorDomain, 1, text("The source was lost")));
    }
  }
}

} // namespace recorder
