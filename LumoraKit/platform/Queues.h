#pragma once

#include <LumoraKit/platform/MainThread.h>

#include <chrono>
#include <memory>
#include <string>

namespace lumora {

/// Runs tasks on threads of the platform's choosing. A serial queue runs one task at a time in the order of the
/// calls; a concurrent one runs all at once. A queue lives until its last task has run. Any thread.
class LUMORA_EXPORT WorkQueue {
public:
  virtual ~WorkQueue();
  /// The name that it was made with, for the log and the debugger.
  virtual const std::string& label() const = 0;
  /// Returns at once.
  virtual void async(Task task) = 0;
};

/// Where work runs. Blocking work may be queued freely: no queue waits for a thread that another one blocks.
class LUMORA_EXPORT Queues {
public:
  virtual ~Queues();

  /// A new serial queue.
  virtual std::shared_ptr<WorkQueue> makeSerialQueue(std::string label) = 0;
  /// The one shared concurrent queue of ordinary priority: for work that blocks.
  virtual std::shared_ptr<WorkQueue> concurrentQueue() = 0;
  /// The one shared concurrent queue of high priority: its tasks are the first to get a thread when threads are scarce.
  virtual std::shared_ptr<WorkQueue> highPriorityQueue() = 0;
  /// The queue of the main thread.
  virtual std::shared_ptr<WorkQueue> mainQueue() = 0;
  /// The queue that the caller runs on: the main queue on the main thread, the serial queue whose task is running,
  /// else null.
  virtual std::shared_ptr<WorkQueue> currentQueue() = 0;
  /// Queues the task after the delay; at once when it is zero or less. Tasks that are due at the same moment keep the
  /// order of the calls.
  virtual void runAfter(std::chrono::nanoseconds delay, std::shared_ptr<WorkQueue> queue, Task task) = 0;
};

} // namespace lumora
