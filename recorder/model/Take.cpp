#include "recorder/model/Take.h"

#include "recorder/model/Texts.h"

#include <algorithm>
#include <utility>

namespace recorder {

lumora::Dictionary Episode::userMetadata() const {
  return {{std::string(LMREpisodeUserMetadataTitleKey), title},
          {std::string(LMREpisodeUserMetadataDescriptionKey), description}};
}

std::shared_ptr<Take> Take::make(Sources sources, const std::string& workflowUUID,
                                 const std::shared_ptr<LMRSession>& session) {
  auto take = std::make_shared<Take>(MadeByFactory(), std::move(sources));
  take->prepare(workflowUUID, session);
  return take;
}

Take::Take(MadeByFactory, Sources sources)
    : sources_(std::move(sources)), queue_(lumora::Platform::current().queues->makeSerialQueue("recorder.take")) {
  for (const auto& source : sources_) {
    recorders_.push_back(source->recorder());
  }
}

void Take::prepare(const std::string& workflowUUID, const std::shared_ptr<LMRSession>& session) {
  recorder_ = LMRMultipleSourceRecorder::recorderWithSourceRecorders(recorders_);
  recorder_->setWorkflowUUID(workflowUUID);
  recorder_->setSession(session);
  recorder_->setDelegate(shared_from_this());
  recorder_->bootstrap();
}

bool Take::isUnderWay() const {
  return state_ != TakeState::Ready && !hasEnded();
}

bool Take::hasEnded() const {
  return state_ == TakeState::Stopped || state_ == TakeState::Cancelled || state_ == TakeState::Failed;
}

void Take::setState(TakeState state) {
  state_ = state;
  changed.notify();
}

// Requests may wait for a server.
void Take::ask(TakeState next, Request request) {
  if (listensToEach_) {
    askEach(request);
  } else {
    queue_->async([recorder = recorder_, request] { ((*recorder).*request)(); });
  }
  setState(next);
}

void Take::askEach(Request request) {
  for (const auto& source : recorders_) {
    if (isLive(source)) {
      queue_->async([source, request] { ((*source).*request)(); });
    }
  }
}

void Take::start() {
  if (state_ == TakeState::Ready) {
    ask(TakeState::Starting, &LMRSourceRecorder::start);
  }
}

void Take::pause() {
  if (state_ == TakeState::Recording) {
    ask(TakeState::Pausing, &LMRSourceRecorder::pause);
  }
}

void Take::resume() {
  if (state_ == TakeState::Paused) {
    ask(TakeState::Resuming, &LMRSourceRecorder::resume);
  }
}

// Also after a source was lost this is the whole's business: it makes the places at the server.
void Take::stop(const Episode& episode) {
  if (state_ == TakeState::Recording || state_ == TakeState::Paused) {
    hasNoPlaceAtServer_ = false;
    recorder_->setMetadata(episode.userMetadata());
    queue_->async([recorder = recorder_] { recorder->stop(); });
    setState(TakeState::Stopping);
  }
}

void Take::stopWithoutServer() {
  if (state_ != TakeState::Recording && state_ != TakeState::Paused) {
    return;
  }
  isWithoutServer_ = true;
  listenToEach();
  for (const auto& source : recorders_) {
    if (isLive(source)) {
      queue_->async([source] { source->isRemote() ? source->cancel() : source->stop(); });
    }
  }
  setState(TakeState::Stopping);
  settle();
}

void Take::cancel() {
  if (state_ == TakeState::Starting) {
    abandon(TakeState::Cancelled);
  } else if (state_ == TakeState::Recording || state_ == TakeState::Paused) {
    ask(TakeState::Cancelling, &LMRSourceRecorder::cancel);
    settle();
  }
}

// Some sources may have begun and others not: nobody waits for what they report.
void Take::abandon(TakeState end) {
  listenToEach();
  isAbandoned_ = true;
  queue_->async([self = shared_from_this(), end] {
    for (const auto& source : self->recorders_) {
      source->cancel();
    }
    lumora::Platform::current().queues->mainQueue()->async([self, end] { self->setState(end); });
  });
  setState(TakeState::Cancelling);
}

void Take::listenToEach() {
  if (!std::exchange(listensToEach_, true)) {
    for (const auto& source : recorders_) {
      source->setDelegate(shared_from_this());
    }
  }
}

void Take::requestFailed(const LMRErrorRef& error) {
  problem_ = error ? error : problem_;
  listenToEach();
  markLostSources(error);
}

// The outcomes.

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

// What is left of it.

std::vector<LMRSubmission> Take::submissions(const Episode& episode) const {
  const auto date = [](const std::optional<lumora::WallTime>& time) {
    return std::chrono::floor<std::chrono::seconds>(*time);
  };
  std::vector<LMRSubmission> all;
  for (const auto& source : recorders_) {
    const auto local = std::dynamic_pointer_cast<LMRLocalVideoRecorder>(source);
    if (!local || !local->submissionUUID() || !local->recordingStartDate()) {
      continue;
    }
    LMRSubmission submission;
    submission.file = *local->outputFileURL();
    submission.submissionUUID = *local->submissionUUID();
    submission.userMetadata = episode.userMetadata();
    submission.recordingMetadata = {
        {std::string(LMREpisodeRecordingMetadataStartDateKey), date(local->recordingStartDate())},
        {std::string(LMREpisodeRecordingMetadataDurationKey), local->elapsedRecordingTime()}};
    if (local->recordingStopDate()) {
      submission.recordingMetadata.set(LMREpisodeRecordingMetadataStopDateKey, date(local->recordingStopDate()));
    }
    submission.deleteAfterSubmission = true;
    all.push_back(std::move(submission));
  }
  return all;
}

std::vector<std::string> Take::files() const {
  std::vector<std::string> all;
  for (const auto& source : recorders_) {
    const auto local = std::dynamic_pointer_cast<LMRLocalVideoRecorder>(source);
    if (local && local->recordingStartDate()) {
      all.push_back(local->outputFileURL()->string());
    }
  }
  return all;
}

} // namespace recorder
