#include "recorder/model/Take.h"

#include "recorder/model/Texts.h"

#include <algorithm>
#include <string>
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
    submission.name = nameOf(submission.file);
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

std::string Take::nameOf(const std::filesystem::path& file) const {
  const auto nameAt = [this](std::size_t place) { return sources_[place]->plan().source.name; };
  for (std::size_t i = 0; i < sources_.size() && sources_.size() > 1; ++i) {
    const auto local = std::dynamic_pointer_cast<LMRLocalVideoRecorder>(recorders_[i]);
    if (local && local->outputFileURL() == file) {
      const auto namesakes = std::ranges::count(
          sources_, nameAt(i), [](const std::shared_ptr<Source>& each) { return each->plan().source.name; });
      return namesakes > 1 ? filled("Source %1", {std::to_string(i + 1)}) : nameAt(i);
    }
  }
  return {};
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
