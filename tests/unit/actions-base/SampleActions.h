#pragma once

#include <LumoraKit/platform/KTAction.h>

#include <functional>
#include <memory>
#include <semaphore>
#include <string>
#include <thread>
#include <utility>
#include <vector>

namespace lumora::tests {

/// An action whose work is a function, which is to call end() or fail().
class SampleAction : public KTAction {
public:
  using Work = std::function<void(SampleAction&)>;

  /// Its work runs on a worker.
  static std::shared_ptr<SampleAction> blocking(Work work) {
    return std::make_shared<SampleAction>(std::move(work), true);
  }
  /// Its work runs on the thread that starts it.
  static std::shared_ptr<SampleAction> composite(Work work) {
    return std::make_shared<SampleAction>(std::move(work), false);
  }
  static std::shared_ptr<SampleAction> succeeding() { return blocking(&SampleAction::end); }
  static std::shared_ptr<SampleAction> failing() { return blocking(&SampleAction::fail); }
  /// Ends when the test says so.
  static std::shared_ptr<SampleAction> waiting() {
    return composite([](SampleAction&) {});
  }

  SampleAction(Work work, bool blocks) : work_(std::move(work)), blocks_(blocks) {}

  void end() { finish(); }
  void fail() {
    setError(sampleError());
    finish();
  }
  void runPart(const KTActionRef& part) { startPart(part); }
  static LMRErrorRef sampleError() { return LMRError::make(LMRErrorDomain, 26, "Not authorized"); }

  std::function<void(SampleAction&)> whenStopping;

private:
  void startExecution() override { work_(*this); }
  void stopExecution() override {
    if (whenStopping) {
      whenStopping(*this);
    }
  }
  bool executionBlocks() const override { return blocks_; }

  const Work work_;
  const bool blocks_;
};

/// What happened, in order, and where the last of it did.
class Story {
public:
  void note(std::string what) {
    events.push_back(std::move(what));
    thread = std::this_thread::get_id();
  }

  std::vector<std::string> events;
  std::thread::id thread;
};

/// A target that notes what it is told.
class Listener : public Story {
public:
  void finished() { note("finished"); }
  void failed() { note("failed"); }
  void finishedWithAction(const std::shared_ptr<SampleAction>& action) {
    received = action;
    note("finished");
  }
  void failedWithBase(const KTActionRef& action) {
    received = action;
    note("failed");
  }

  KTActionRef received;
};

/// A target that lets a test wait for an end that comes on another thread.
class EndWaiter {
public:
  void told() { ended_.release(); }
  void wait() { ended_.acquire(); }

private:
  std::binary_semaphore ended_{0};
};

/// A new waiter that is both targets of the action.
inline std::shared_ptr<EndWaiter> waiterFor(KTAction& action) {
  auto waiter = std::make_shared<EndWaiter>();
  action.setFinishTarget_selector(waiter, &EndWaiter::told);
  action.setErrorTarget_selector(waiter, &EndWaiter::told);
  return waiter;
}

/// A new listener that is both targets of the action.
inline std::shared_ptr<Listener> listenerOf(KTAction& action) {
  auto listener = std::make_shared<Listener>();
  action.setFinishTarget_selector(listener, &Listener::finished);
  action.setErrorTarget_selector(listener, &Listener::failed);
  return listener;
}

} // namespace lumora::tests
