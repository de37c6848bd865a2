#pragma once

#include <LumoraKit/platform/Export.h>
#include <LumoraKit/platform/MainThread.h>

#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <map>
#include <memory>
#include <mutex>
#include <utility>

namespace lumora::backend {

/// One thread that runs short tasks when their time has come. Any thread.
class LUMORA_INTERNAL DelayedTasks {
public:
  /// Starts the thread; waits while the machine cannot give one.
  static std::shared_ptr<DelayedTasks> make();

  /// Runs the task after the delay; tasks of the same moment in the order of the calls. The task must not block.
  void runAfter(std::chrono::nanoseconds delay, Task task);
  /// The thread ends once its last task has run.
  void stopWhenEmpty();

private:
  using Clock = std::chrono::steady_clock;

  void serve();

  std::mutex mutex_;
  std::condition_variable changed_;
  std::multimap<Clock::time_point, Task> tasks_;
  bool stopping_ = false;
};

} // namespace lumora::backend
