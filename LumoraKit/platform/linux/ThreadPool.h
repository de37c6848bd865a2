#pragma once

#include <LumoraKit/platform/Export.h>
#include <LumoraKit/platform/MainThread.h>

#include <chrono>
#include <condition_variable>
#include <cstddef>
#include <deque>
#include <functional>
#include <memory>
#include <mutex>

namespace lumora::backend {

class DelayedTasks;

/// Starts a detached thread; false when the machine cannot give one.
using ThreadStarter = std::function<bool(Task body)>;

/// Starts a detached thread that leaves the process's signals to the application's own threads.
LUMORA_INTERNAL bool startThread(Task body);

/// Threads without a limit: a task never waits for a thread that another task blocks. A thread that had nothing to do
/// for a while ends. When the machine gives no more threads, tasks wait for one that becomes free, and new threads are
/// tried for until the last task has got one. Held by its threads, so it outlives its owner until they have ended.
class LUMORA_INTERNAL ThreadPool : public std::enable_shared_from_this<ThreadPool> {
public:
  enum class Priority { Ordinary, High };

  ThreadPool(std::shared_ptr<DelayedTasks> retries, ThreadStarter start,
             std::chrono::milliseconds idleTime = std::chrono::seconds(5));

  /// Returns at once. Any thread.
  void post(Task task, Priority priority);

private:
  void grow();
  void growLater();
  bool needsThread() const;
  void work();
  bool waitForTask(std::unique_lock<std::mutex>& lock);
  Task takeNext();

  const std::shared_ptr<DelayedTasks> retries_;
  const ThreadStarter start_;
  const std::chrono::milliseconds idleTime_;
  std::mutex mutex_;
  std::condition_variable posted_;
  std::deque<Task> highTasks_;
  std::deque<Task> tasks_;
  std::size_t idle_ = 0;
  std::size_t starting_ = 0;
  bool retrying_ = false;
};

} // namespace lumora::backend
