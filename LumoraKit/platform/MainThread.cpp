#include <LumoraKit/platform/MainThread.h>

#include <condition_variable>
#include <mutex>

namespace lumora {
namespace {

class Signal {
public:
  void raise() {
    // Told under the lock: the waiter, who owns this object, cannot leave before.
    const std::lock_guard lock(mutex_);
    raised_ = true;
    changed_.notify_one();
  }

  void wait() {
    std::unique_lock lock(mutex_);
    changed_.wait(lock, [this] { return raised_; });
  }

private:
  std::mutex mutex_;
  std::condition_variable changed_;
  bool raised_ = false;
};

} // namespace

MainThread::~MainThread() = default;

void MainThread::runAndWait(const Task& task) {
  if (isCurrent()) {
    task();
    return;
  }
  Signal ended;
  post([&] {
    task();
    ended.raise();
  });
  ended.wait();
}

} // namespace lumora
