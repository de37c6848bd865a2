#include <LumoraKit/platform/Assert.h>
#include <LumoraKit/platform/KTAction.h>
#include <LumoraKit/platform/Platform.h>

#include <utility>

namespace lumora::detail {

void wrongActionClass() {
  assertionFailed("the selector takes the action's own class", "finish", "KTAction");
}

} // namespace lumora::detail

// States of an action:
//
//   Ready --start(), runSynchronously()--> Running --finish()--> Finished
//
// The end is delivered once, by whoever made the last step. From start to end the action holds itself (self_): its
// targets are weak, and the caller may drop it.

KTAction::KTAction() = default;

KTAction::~KTAction() = default;

void KTAction::start() {
  const auto self = shared_from_this();
  const auto& queues = lumora::Platform::current().queues;
  endQueue_ = queues->currentQueue();
  if (!endQueue_) {
    endQueue_ = queues->concurrentQueue();
  }
  begin("start");
  if (executionBlocks()) {
    queues->concurrentQueue()->async([self] { self->startExecution(); });
  } else {
    startExecution();
  }
}

void KTAction::runSynchronously() {
  const auto self = shared_from_this();
  begin("runSynchronously");
  startExecution();
  state_.wait(State::Running);
  end();
}

void KTAction::begin(const char* operation) {
  auto ready = State::Ready;
  const bool isFirst = state_.compare_exchange_strong(ready, State::Running);
  lumora::assertThat(isFirst, "an action is run once", operation, "KTAction");
  self_ = shared_from_this();
  running_ = true;
  runningNotifier_.notify();
}

void KTAction::finish() {
  const auto self = shared_from_this();
  auto running = State::Running;
  if (!state_.compare_exchange_strong(running, State::Finished)) {
    return;
  }
  if (endQueue_) {
    endQueue_->async([self] { self->end(); });
  } else {
    state_.notify_all();
  }
}

void KTAction::end() {
  const auto self = std::exchange(self_, nullptr);
  stopExecution();
  running_ = false;
  runningNotifier_.notify();
  if (const auto message = error() ? errorMessage_.get() : finishMessage_.get()) {
    message(self);
  }
  if (const auto observer = std::exchange(endObserver_, nullptr)) {
    observer();
  }
}

void KTAction::setError(LMRErrorRef error) {
  if (state_ != State::Finished) {
    error_.set(std::move(error));
  }
}

void KTAction::stopExecution() {}

bool KTAction::executionBlocks() const {
  return true;
}

bool KTAction::hasStarted() const {
  return state_ != State::Ready;
}

void KTAction::startPart(const KTActionRef& part) {
  if (runsSynchronously()) {
    part->runSynchronously();
  } else {
    part->start();
  }
}

void KTAction::setEndObserver(const KTActionRef& part, std::function<void()> observer) {
  part->endObserver_ = std::move(observer);
}

lumora::Connection KTAction::observeRunning(std::function<void()> observer) {
  return runningNotifier_.observe(std::move(observer));
}

void KTAction::notifyRunningObservers() {
  runningNotifier_.notify();
}

void KTAction::setFinishTarget(std::nullptr_t) {
  setFinishMessage(nullptr);
}

void KTAction::setErrorTarget(std::nullptr_t) {
  setErrorMessage(nullptr);
}

void KTAction::setFinishMessage(lumora::detail::ActionMessage message) {
  finishMessage_.set(std::move(message));
}

void KTAction::setErrorMessage(lumora::detail::ActionMessage message) {
  errorMessage_.set(std::move(message));
}
