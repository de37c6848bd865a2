#include <LumoraKit/platform/Value.h>
#include <LumoraKit/testing/FakeRecorders.h>

namespace lumora::fakes {

RecorderRequests::RecorderRequests() = default;
RecorderRequests::~RecorderRequests() = default;

std::vector<std::string> RecorderRequests::requests() const {
  const std::lock_guard lock(mutex_);
  return requests_;
}

void RecorderRequests::forgetRequests() {
  const std::lock_guard lock(mutex_);
  requests_.clear();
}

void RecorderRequests::setAnswer(Answer answer) {
  const std::lock_guard lock(mutex_);
  answer_ = std::move(answer);
}

void RecorderRequests::succeed(LMRSourceRecorder& recorder, const std::string& request) {
  if (request.starts_with("start")) {
    recorder.didStartRecording();
  } else if (request == "pause") {
    recorder.didPauseRecording();
  } else if (request == "resume") {
    recorder.didResumeRecording();
  } else if (request == "stop") {
    recorder.didStopRecording();
  } else if (request == "cancel") {
    recorder.didCancelRecording();
  }
}

void RecorderRequests::takeStart(LMRSourceRecorder& recorder, double delay) {
  recorder.setIsStarting(true);
  take(recorder, "start " + Value(delay).description());
}

void RecorderRequests::take(LMRSourceRecorder& recorder, const std::string& request) {
  Answer answer;
  {
    const std::lock_guard lock(mutex_);
    requests_.push_back(request);
    answer = answer_;
  }
  if (answer) {
    answer(recorder, request);
  }
}

FakeLocalRecorder::~FakeLocalRecorder() = default;
FakeRemoteRecorder::~FakeRemoteRecorder() = default;
FakeUnknownRecorder::~FakeUnknownRecorder() = default;

std::string FakeUnknownRecorder::className() const {
  return "FakeUnknownRecorder";
}

} // namespace lumora::fakes
