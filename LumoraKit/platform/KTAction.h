#pragma once

#include <LumoraKit/platform/LMRError.h>
#include <LumoraKit/platform/Observable.h>
#include <LumoraKit/platform/Property.h>
#include <LumoraKit/platform/Queues.h>

#include <atomic>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <type_traits>

class KTAction;

/// Held by whoever starts an action; a started action also keeps itself alive until it has ended.
using KTActionRef = std::shared_ptr<KTAction>;

namespace lumora::detail {

using ActionMessage = std::function<void(const KTActionRef& action)>;

[[noreturn]] LUMORA_EXPORT void wrongActionClass();

template <class Target, class Class, class Action>
void sendWithAction(Target& target, void (Class::*selector)(const std::shared_ptr<Action>&),
                    const KTActionRef& action) {
  auto received = std::dynamic_pointer_cast<Action>(action);
  if (!received) {
    wrongActionClass();
  }
  (target.*selector)(received);
}

/// The message to a target, held weakly: `selector` is as for KTAction::setFinishTarget_selector().
template <class Target, class Selector>
ActionMessage actionMessage(const std::shared_ptr<Target>& target, Selector selector) {
  if (!target) {
    return nullptr;
  }
  return [weak = std::weak_ptr<Target>(target), selector](const KTActionRef& action) {
    const auto receiver = weak.lock();
    if (!receiver) {
      return;
    }
    if constexpr (std::is_invocable_v<Selector, Target&>) {
      ((*receiver).*selector)();
    } else {
      sendWithAction(*receiver, selector, action);
    }
  };
}

} // namespace lumora::detail

/// One asynchronous operation that is run once and reports success or failure to a target.
///
/// Without blocking the caller:
///
///     action->setFinishTarget_selector(recorder, &Recorder::startedWithAction);
///     action->setErrorTarget_selector(recorder, &Recorder::failedWithAction);
///     action->start();
///
/// On a thread that may block:
///
///     action->runSynchronously();
///     if (action->error()) { ... }
///
/// A subclass overrides startExecution() and calls finish() once its work is done, after setError() when it failed.
///
/// The end has one order: the error is final, stopExecution() runs, isRunning() turns false and its observers are
/// told, then one target is told, once: the error target when there is an error, else the finish target. After
/// start() the end is delivered on the queue that start() was called on (the main queue, or the serial queue of the
/// calling task), on a worker when the caller had none. It comes on a later turn of that queue, never inside
/// start(), and waits for as long as nobody serves the queue. After runSynchronously() it is delivered on the calling
/// thread, before the return.
class LUMORA_EXPORT KTAction : public std::enable_shared_from_this<KTAction> {
public:
  KTAction(const KTAction&) = delete;
  KTAction& operator=(const KTAction&) = delete;
  virtual ~KTAction();

  /// Begins the action and returns at once. An action is run once, by this or by runSynchronously(): a second time is
  /// a programming error (asserted). Any thread.
  void start();
  /// Runs the action, with startExecution() on the calling thread, and returns after it has ended and its target has
  /// been told. Blocks. Any thread.
  void runSynchronously();

  /// Whom to tell of the end: `selector` is a member function of `target`, or of a base class of it, that takes
  /// nothing, or the action as `const std::shared_ptr<A>&` with A this class or one that the action is of (any other
  /// is asserted). The target is held weakly: one that died is not told. A null target clears. The last one set before
  /// the end counts. Any thread.
  template <class Target, class Selector>
  void setFinishTarget_selector(const std::shared_ptr<Target>& target, Selector selector) {
    setFinishMessage(lumora::detail::actionMessage(target, selector));
  }
  /// The same for the action's failure: `selector` is called with the action, whose error() is set.
  template <class Target, class Selector>
  void setErrorTarget_selector(const std::shared_ptr<Target>& target, Selector selector) {
    setErrorMessage(lumora::detail::actionMessage(target, selector));
  }
  /// Clears the target: nobody is told of the success.
  void setFinishTarget(std::nullptr_t);
  /// Clears the target of the failure.
  void setErrorTarget(std::nullptr_t);

  /// Null while the action has not failed. Any thread.
  LMRErrorRef error() const { return error_.get(); }
  /// Sets what the action will fail with; null: it will succeed. Ignored once finish() was called. Any thread.
  void setError(LMRErrorRef error);

  /// The progress text for the user. Any thread.
  std::string description() const { return description_.get(); }
  void setDescription(std::string description) { description_.set(std::move(description)); }

  /// What the caller wants carried with the action; absent unless set. Any thread.
  std::optional<lumora::Dictionary> userInfo() const { return userInfo_.get(); }
  void setUserInfo(std::optional<lumora::Dictionary> userInfo) { userInfo_.set(std::move(userInfo)); }

  /// True from the start until just before the target is told. Any thread.
  bool isRunning() const { return running_.load(std::memory_order_acquire); }
  /// Calls the observer after each change of isRunning(), on the thread that changed it: the one that starts the
  /// action, and the one that the end is delivered on. Any thread.
  [[nodiscard]] lumora::Connection observeRunning(std::function<void()> observer);
  /// Tells the observers of isRunning() although it did not change. Any thread.
  void notifyRunningObservers();

protected:
  KTAction();

  /// Does the work, and sees to it that finish() is called in the end, here or later. Runs on a worker when
  /// executionBlocks(), else inside start(); on the calling thread of runSynchronously().
  virtual void startExecution() = 0;
  /// Called once at the end, with error() final and isRunning() still true.
  virtual void stopExecution();
  /// Whether startExecution() blocks its thread. True unless overridden; an action that only starts others says
  /// false.
  virtual bool executionBlocks() const;

  /// Ends the action. To be called by the subclass once it is done, on any thread. Ignored before the start and after
  /// the first call.
  void finish();

  /// Whether start() or runSynchronously() has been called.
  bool hasStarted() const;
  /// Whether the action is run by runSynchronously(). Of a started action.
  bool runsSynchronously() const { return !endQueue_; }

  /// Runs an action that this one is made of, the way this one is run: with runSynchronously(), so that no queue need
  /// be served, or with start().
  void startPart(const KTActionRef& part);

  /// Calls the observer once, after the part's own target has been told. To be set before the part is started.
  static void setEndObserver(const KTActionRef& part, std::function<void()> observer);

private:
  enum class State { Ready, Running, Finished };

  void begin(const char* operation);
  void end();
  void setFinishMessage(lumora::detail::ActionMessage message);
  void setErrorMessage(lumora::detail::ActionMessage message);

  lumora::Property<LMRErrorRef> error_;
  lumora::Property<std::string> description_;
  lumora::Property<std::optional<lumora::Dictionary>> userInfo_;
  lumora::Property<lumora::detail::ActionMessage> finishMessage_;
  lumora::Property<lumora::detail::ActionMessage> errorMessage_;
  lumora::Notifier runningNotifier_;
  std::atomic<bool> running_{false};
  std::atomic<State> state_{State::Ready};
  std::function<void()> endObserver_;
  // Where the end is delivered; null while Ready and when run synchronously.
  std::shared_ptr<lumora::WorkQueue> endQueue_;
  KTActionRef self_;
};
