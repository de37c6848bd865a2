#include "Model.h"

#include <algorithm>

namespace model {
namespace {

constexpr Verb verbs[] = {Verb::Start, Verb::Pause, Verb::Resume, Verb::Stop, Verb::Cancel};

std::string word(Verb verb) {
  constexpr const char* words[] = {"start", "pause", "resume", "stop", "cancel"};
  return words[static_cast<std::size_t>(verb)];
}

std::string capitalized(Verb verb) {
  constexpr const char* words[] = {"Start", "Pause", "Resume", "Stop", "Cancel"};
  return words[static_cast<std::size_t>(verb)];
}

// What every recorder does to its own flags.
void succeed(Verb verb, Flags& flags) {
  switch (verb) {
  case Verb::Start:
    flags.isStarting = false;
    flags.isRecording = true;
    flags.isPaused = false;
    break;
  case Verb::Pause:
    flags.isRecording = false;
    flags.isPaused = true;
    break;
  case Verb::Resume:
    flags.isRecording = true;
    flags.isPaused = false;
    break;
  case Verb::Stop:
    flags.isRecording = false;
    flags.isPaused = false;
    break;
  case Verb::Cancel:
    flags.isRecording = false;
    flags.isPaused = false;
    flags.isCancelled = true;
    break;
  }
}

void fail(Verb verb, Flags& flags) {
  if (verb == Verb::Start) {
    flags.isStarting = false;
  }
}

std::string letters(const Flags& flags) {
  return std::string(flags.isStarting ? "s" : "-") + (flags.isRecording ? "r" : "-") + (flags.isPaused ? "p" : "-") +
         (flags.isCancelled ? "c" : "-");
}

} // namespace

std::string text(const Event& event) {
  const std::string source = "source " + std::to_string(event.source);
  switch (event.type) {
  case Event::Type::Request:
    return word(event.verb);
  case Event::Type::StopWithoutContainer:
    return "stop without a container";
  case Event::Type::Success:
    return source + " did " + word(event.verb);
  case Event::Type::Failure:
    return source + " failed to " + word(event.verb);
  }
  return "";
}

std::vector<Event> allEvents(std::size_t sourceCount) {
  std::vector<Event> all{{Event::Type::StopWithoutContainer, Verb::Stop, 0}};
  for (const Verb verb : verbs) {
    all.push_back({Event::Type::Request, verb, 0});
    for (std::size_t source = 0; source < sourceCount; ++source) {
      all.push_back({Event::Type::Success, verb, source});
      all.push_back({Event::Type::Failure, verb, source});
    }
  }
  return all;
}

std::uint32_t State::key() const {
  std::uint32_t key = listens ? 1 : 0;
  const auto add = [&key](bool flag) { key = key * 2 + (flag ? 1 : 0); };
  add(recorder.isStarting);
  for (const Flags* flags : {&recorder, &sources[0], &sources[1], &sources[2]}) {
    add(flags->isRecording);
    add(flags->isPaused);
    add(flags->isCancelled);
  }
  return key;
}

std::string State::text(std::size_t sourceCount) const {
  std::string all = letters(recorder) + (listens ? " |" : " (deaf) |");
  for (std::size_t source = 0; source < sourceCount; ++source) {
    all += " " + letters(sources[source]);
  }
  return all;
}

std::vector<std::string> Model::apply(const Event& event, State& state) {
  state_ = &state;
  trace_.clear();
  switch (event.type) {
  case Event::Type::Request:
    event.verb == Verb::Stop ? stop() : request(event.verb);
    break;
  case Event::Type::StopWithoutContainer:
    isTester_ ? stop() : reportFailure(Verb::Stop, containerError);
    break;
  case Event::Type::Success:
    succeed(event.verb, state.sources[event.source]);
    if (state.listens) {
      succeeded(event.verb, event.source);
    }
    break;
  case Event::Type::Failure:
    fail(event.verb, state.sources[event.source]);
    if (state.listens) {
      failed(event.verb, event.source);
    }
    break;
  }
  return trace_;
}

bool Model::isMixed() const {
  const auto remotes = std::count(mix_.begin(), mix_.end(), Kind::Remote);
  return remotes > 0 && remotes < static_cast<std::ptrdiff_t>(mix_.size());
}

// A start, a pause, a resume: to the remote sources of a mix, else to all. A cancel: to all.
void Model::request(Verb verb) {
  if (verb == Verb::Start) {
    state_->recorder.isStarting = true;
  }
  for (std::size_t source = 0; source < mix_.size(); ++source) {
    if (verb == Verb::Cancel || !isMixed() || isRemote(source)) {
      ask(source, verb, delay);
    }
  }
}

// The sources are listed backwards in the submission order.
void Model::stop() {
  if (isTester_) {
    for (std::size_t source = 0; source < mix_.size(); ++source) {
      trace_.push_back(std::to_string(source) + " stop");
    }
    return;
  }
  std::vector<std::string> asked;
  for (std::size_t source = mix_.size(); source-- > 0;) {
    if (mix_[source] == Kind::Unknown) {
      trace_.emplace_back("(LMRMultipleSourceRecorder) Don't know how to stop/submit a FakeUnknownRecorder!");
    } else {
      asked.push_back(std::to_string(source) + " stop UUID " + std::to_string(asked.size()));
    }
  }
  trace_.insert(trace_.end(), asked.begin(), asked.end());
}

void Model::ask(std::size_t source, Verb verb, int delayOfStart) {
  auto line = std::to_string(source) + " " + word(verb);
  if (verb == Verb::Start) {
    state_->sources[source].isStarting = true;
    line += " " + std::to_string(delayOfStart);
  }
  trace_.push_back(std::move(line));
}

void Model::succeeded(Verb verb, std::size_t source) {
  switch (verb) {
  case Verb::Start:
  case Verb::Pause:
  case Verb::Resume:
    startedOrPausedOrResumed(verb);
    break;
  case Verb::Stop:
    stopped(source);
    break;
  case Verb::Cancel:
    if (everySource([this](std::size_t i) { return state_->sources[i].isCancelled; }) &&
        !state_->recorder.isCancelled) {
      report(Verb::Cancel);
    }
    break;
  }
}

void Model::startedOrPausedOrResumed(Verb verb) {
  const auto records = [this](std::size_t i) { return state_->sources[i].isRecording; };
  const auto isPaused = [this](std::size_t i) { return state_->sources[i].isPaused; };
  const auto isNotPaused = [this](std::size_t i) { return !state_->sources[i].isPaused; };
  if (isMixed()) {
    const auto isDone = [&](std::size_t i) {
      return verb == Verb::Start ? records(i) : verb == Verb::Pause ? isPaused(i) : isNotPaused(i);
    };
    if (!everySource([&](std::size_t i) { return !isRemote(i) || isDone(i); })) {
      return;
    }
    for (std::size_t i = 0; i < mix_.size(); ++i) {
      if (!isRemote(i) && !isDone(i)) {
        ask(i, verb, 0);
      }
    }
  }
  const Flags& own = state_->recorder;
  if ((verb == Verb::Start && everySource(records) && !own.isRecording) ||
      (verb == Verb::Pause && everySource(isPaused) && !own.isPaused) ||
      (verb == Verb::Resume && (everySource(records) || everySource(isNotPaused)) && !own.isRecording &&
       own.isPaused)) {
    report(verb);
  }
}

void Model::stopped(std::size_t source) {
  const std::string own = "(LMRMultipleSourceRecorder) Successfully stopped ";
  const std::string end = "for multi source recording";
  if (mix_[source] == Kind::Remote) {
    trace_.push_back(own + "remote recorder 'Camera " + std::to_string(source) + "'  " + end);
  } else if (!isTester_) {
    const std::string className = mix_[source] == Kind::Local ? "LMRLocalVideoRecorder" : "FakeUnknownRecorder";
    trace_.push_back(own + "local recorder '" + className + "' " + end);
  }
  if (everySource([this](std::size_t i) { return !state_->sources[i].isRecording && !state_->sources[i].isPaused; })) {
    trace_.push_back(own + "all recorders " + end);
    report(Verb::Stop);
  }
}

void Model::failed(Verb verb, std::size_t source) {
  state_->listens = false;
  reportFailure(verb, firstSourceError + static_cast<int>(source));
}

void Model::report(Verb verb) {
  succeed(verb, state_->recorder);
  trace_.push_back("told recorderDid" + capitalized(verb) + "Recording:");
}

void Model::reportFailure(Verb verb, int error) {
  fail(verb, state_->recorder);
  trace_.push_back("told recorderFailedTo" + capitalized(verb) + "Recording:error: " + std::to_string(error));
}

} // namespace model
