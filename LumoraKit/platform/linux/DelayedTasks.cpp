#include <LumoraKit/platform/linux/DelayedTasks.h>
#include <LumoraKit/platform/linux/ThreadPool.h>

#include <thread>

namespace lumora::backend {

std::shared_ptr<DelayedTasks> DelayedTasks::make() {
  auto tasks = std::make_shared<DelayedTasks>();
  while (!startThread([tasks] { tasks->serve(); })) {
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
  }
  return tasks;
}

void DelayedTasks::runAfter(std::chrono::nanoseconds delay, Task task) {
  const auto now = Clock::now();
  const auto due = delay < Clock::time_point::max() - now ? now + delay : Clock::time_point::max();
  {
    const std::lock_guard lock(mutex_);
    tasks_.emplace(due, std::move(task));
  }
  changed_.notify_one();
}

void DelayedTasks::stopWhenEmpty() {
  {
    const std::lock_guard lock(mutex_);
    stopping_ = true;
  }
  changed_.notify_one();
}

void DelayedTasks::serve() {
  std::unique_lock lock(mutex_);
  while (!tasks_.empty() || !stopping_) {
    if (tasks_.empty()) {
      changed_.wait(lock);
    } else if (const auto due = tasks_.begin()->first; Clock::now() < due) {
      changed_.wait_until(lock, due);
    } else {
      Task task = std::move(tasks_.extract(tasks_.begin()).mapped());
      lock.unlock();
      task();
      task = nullptr;
      lock.lock();
    }
  }
}

} // namespace lumora::backend
