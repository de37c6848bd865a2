#pragma once

#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/Queues.h>

#include <chrono>
#include <cstddef>
#include <memory>
#include <string>

namespace lumora::fakes {

/// Queues and a main thread on which nothing happens until the test says so, and whose time the test moves. Every
/// task runs on the thread that made this object, so the order is the same in every run.
///
///     const auto queues = std::make_shared<lumora::fakes::ManualQueues>();
///     auto platform = lumora::Platform::current();
///     platform.queues = queues;
///     platform.mainThread = queues->mainThread();
///     lumora::Platform::install(platform);
///     recorder->startWithDelay(5);
///     queues->advance(std::chrono::seconds(5));
///
/// Tasks may be queued by any thread, also with a delay; everything else is for the thread that made the object. That
/// thread counts as the main thread, also inside a task of another queue.
class LUMORA_EXPORT ManualQueues final : public Queues {
public:
  ManualQueues();
  ~ManualQueues() override;

  /// The main thread that goes with these queues. Its serveUntil() runs what is queued and moves the time along; it
  /// returns false at once when there is nothing left that could happen.
  std::shared_ptr<MainThread> mainThread() const;

  /// Runs the task that was queued first, of whichever queue; false when there is none.
  bool runNext();
  /// Runs tasks, also those queued meanwhile, until there are none. Returns how many ran.
  std::size_t runAll();
  /// Moves the time, running everything as it becomes due.
  void advance(std::chrono::nanoseconds time);
  /// How many tasks wait to be run; those with a delay that is not over do not count.
  std::size_t pending() const;

  std::shared_ptr<WorkQueue> makeSerialQueue(std::string label) override;
  std::shared_ptr<WorkQueue> concurrentQueue() override;
  std::shared_ptr<WorkQueue> highPriorityQueue() override;
  std::shared_ptr<WorkQueue> mainQueue() override;
  std::shared_ptr<WorkQueue> currentQueue() override;
  void runAfter(std::chrono::nanoseconds delay, std::shared_ptr<WorkQueue> queue, Task task) override;

private:
  class Schedule;
  class Queue;
  class MainThreadOfSchedule;

  const std::shared_ptr<Schedule> schedule_;
  const std::shared_ptr<WorkQueue> mainQueue_;
  const std::shared_ptr<WorkQueue> concurrentQueue_;
  const std::shared_ptr<WorkQueue> highPriorityQueue_;
  const std::shared_ptr<MainThread> mainThread_;
};

} // namespace lumora::fakes
