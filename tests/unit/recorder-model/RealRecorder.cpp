#include "RealRecorder.h"

#include "support/Sessions.h"

namespace model {

using lumora::fakes::ToolReply;

RealPlatform::RealPlatform(bool isTester) {
  if (isTester) {
    platform_.application->setIdentifier("org.vantor.lumora.recordertester");
  }
  platform_.toolRunner->reply("create_recording",
                              ToolReply::success({{"submission_uuids", lumora::Array{"UUID 0", "UUID 1", "UUID 2"}}}));
  auto platform = lumora::Platform::current();
  platform.queues = queues_;
  platform.mainThread = queues_->mainThread();
  platform.log = log_;
  lumora::Platform::install(platform);
}

void RealPlatform::OwnLinesLog::write(std::string_view line) {
  if (trace && line.starts_with("(LMRMultipleSourceRecorder)")) {
    trace->emplace_back(line);
  }
}

RealRecorder::RealRecorder(const RealPlatform& platform, const Mix& mix) : platform_(platform) {
  for (const Kind kind : mix) {
    const auto index = sources_.size();
    errors_.push_back(LMRError::make("source", firstSourceError + static_cast<int>(index), "Failed"));
    sources_.push_back(makeSource(kind, index));
  }
  recorder_ = LMRMultipleSourceRecorder::recorderWithSourceRecorders(sources_);
  recorder_->setWorkflowUUID("WORKFLOW");
  recorder_->setSession(lumora::tests::kerberosSession());
  std::vector<std::size_t> backwards;
  for (std::size_t source = mix.size(); source-- > 0;) {
    backwards.push_back(source);
  }
  recorder_->setSourceRecorderSubmissionOrder(backwards);
}

RealRecorder::~RealRecorder() {
  platform_.traceInto(nullptr);
}

std::shared_ptr<LMRSourceRecorder> RealRecorder::makeSource(Kind kind, std::size_t index) {
  switch (kind) {
  case Kind::Local:
    return traced(lumora::fakes::FakeLocalRecorder::make(), index);
  case Kind::Remote:
    return traced(lumora::fakes::FakeRemoteRecorder::make("Camera " + std::to_string(index)), index);
  case Kind::Unknown:
    return traced(lumora::fakes::FakeUnknownRecorder::make(), index);
  }
  return nullptr;
}

template <class Source>
std::shared_ptr<LMRSourceRecorder> RealRecorder::traced(std::shared_ptr<Source> source, std::size_t index) {
  source->setAnswer([this, index](const LMRSourceRecorder& recorder, const std::string& request) {
    std::optional<std::string> uuid;
    if constexpr (requires(const Source& known) { known.submissionUUID(); }) {
      uuid = static_cast<const Source&>(recorder).submissionUUID();
    }
    const bool hasUUID = request == "stop" && uuid;
    trace_.push_back(std::to_string(index) + " " + request + (hasUUID ? " " + *uuid : ""));
  });
  requestsOfSources_.push_back(source.get());
  return source;
}

void RealRecorder::listenToDelegate() {
  delegate_ = std::make_shared<lumora::tests::RecordingDelegate>();
  delegate_->onMessage = [this](const std::string& selector) {
    const auto error = delegate_->messages().back().error;
    trace_.push_back("told " + selector + (error ? " " + std::to_string(error->code()) : ""));
  };
  recorder_->setDelegate(delegate_);
}

State RealRecorder::state() const {
  const auto flags = [](const LMRSourceRecorder& recorder) {
    return Flags{recorder.isStarting(), recorder.isRecording(), recorder.isPaused(), recorder.isCancelled()};
  };
  State state;
  state.recorder = flags(*recorder_);
  for (std::size_t source = 0; source < sources_.size(); ++source) {
    state.sources[source] = flags(*sources_[source]);
    state.listens = sources_[source]->delegate() == recorder_;
  }
  return state;
}

void RealRecorder::setState(const State& state) {
  const auto set = [](LMRSourceRecorder& recorder, const Flags& flags) {
    recorder.setIsStarting(flags.isStarting);
    recorder.setIsRecording(flags.isRecording);
    recorder.setIsPaused(flags.isPaused);
    recorder.setIsCancelled(flags.isCancelled);
  };
  set(*recorder_, state.recorder);
  for (std::size_t source = 0; source < sources_.size(); ++source) {
    set(*sources_[source], state.sources[source]);
    sources_[source]->setDelegate(state.listens ? recorder_ : nullptr);
  }
}

std::vector<std::string> RealRecorder::apply(const Event& event) {
  trace_.clear();
  platform_.traceInto(&trace_);
  listenToDelegate();
  switch (event.type) {
  case Event::Type::Request:
    request(event.verb);
    break;
  case Event::Type::StopWithoutContainer:
    platform_.toolRunner().replyOnce("create_recording", ToolReply::failure(containerError));
    request(Verb::Stop);
    break;
  case Event::Type::Success:
    report(event);
    break;
  case Event::Type::Failure:
    reportFailure(event);
    break;
  }
  platform_.queues()->runAll();
  platform_.toolRunner().forgetRequests();
  for (auto* const requests : requestsOfSources_) {
    requests->forgetRequests();
  }
  return trace_;
}

void RealRecorder::request(Verb verb) {
  switch (verb) {
  case Verb::Start:
    return recorder_->startWithDelay(delay);
  case Verb::Pause:
    return recorder_->pause();
  case Verb::Resume:
    return recorder_->resume();
  case Verb::Stop:
    return recorder_->stop();
  case Verb::Cancel:
    return recorder_->cancel();
  }
}

void RealRecorder::report(const Event& event) {
  auto& source = *sources_[event.source];
  switch (event.verb) {
  case Verb::Start:
    return source.didStartRecording();
  case Verb::Pause:
    return source.didPauseRecording();
  case Verb::Resume:
    return source.didResumeRecording();
  case Verb::Stop:
    return source.didStopRecording();
  case Verb::Cancel:
    return source.didCancelRecording();
  }
}

void RealRecorder::reportFailure(const Event& event) {
  auto& source = *sources_[event.source];
  const auto& error = errors_[event.source];
  switch (event.verb) {
  case Verb::Start:
    return source.failedToStartRecordingWithError(error);
  case Verb::Pause:
    return source.failedToPauseRecordingWithError(error);
  case Verb::Resume:
    return source.failedToResumeRecordingWithError(error);
  case Verb::Stop:
    return source.failedToStopRecordingWithError(error);
  case Verb::Cancel:
    return source.failedToCancelRecordingWithError(error);
  }
}

} // namespace model
