#include <LumoraKit/platform/Assert.h>
#include <LumoraKit/platform/KTActionQueue.h>

#include <utility>

KTActionQueue::KTActionQueue() = default;

std::shared_ptr<KTActionQueue> KTActionQueue::queue() {
  return std::shared_ptr<KTActionQueue>(new KTActionQueue);
}

void KTActionQueue::queueAction(KTActionRef action) {
  lumora::assertThat(action != nullptr, "action != nil", "queueAction", "KTActionQueue");
  lumora::assertThat(!hasStarted(), "the queue has not been started", "queueAction", "KTActionQueue");
  actions_.push_back(std::move(action));
}

void KTActionQueue::startExecution() {
  runNext();
}

// A queue that runs synchronously loops here; otherwise each action's end calls this again.
void KTActionQueue::runNext() {
  while (!error() && !actions_.empty()) {
    const auto action = std::move(actions_.front());
    actions_.pop_front();
    if (!runsSynchronously()) {
      setEndObserver(action, [this, ended = action.get()] {
        setError(ended->error());
        runNext();
      });
      action->start();
      return;
    }
    action->runSynchronously();
    setError(action->error());
  }
  actions_.clear();
  finish();
}
