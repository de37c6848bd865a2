#pragma once

#include <LumoraKit/platform/Export.h>

#include <chrono>
#include <functional>

namespace lumora {

/// One piece of work for a queue or for the main thread. It must not throw.
using Task = std::function<void()>;

/// The way to the process's first thread, where delegate messages are delivered. Any thread, except as noted.
class LUMORA_EXPORT MainThread {
public:
  virtual ~MainThread();

  /// Whether the caller is on the main thread.
  virtual bool isCurrent() const = 0;

  /// Runs the task on a later turn of the main thread's loop, in the order of the calls. Returns at once.
  virtual void post(Task task) = 0;

  /// Runs the task on the main thread and returns after it has ended; inline when already there.
  /// Blocks for as long as nobody serves the main thread.
  void runAndWait(const Task& task);

  /// Serves the main thread until the condition holds or the time is over: for programs that have no main loop of
  /// their own (a terminal program, a test). The condition is asked first, after every piece of work, and every few
  /// milliseconds, so that it may also look at what other threads do. Main thread only (asserted). True when the
  /// condition holds.
  virtual bool serveUntil(const std::function<bool()>& condition,
                          std::chrono::milliseconds limit = std::chrono::milliseconds::max()) = 0;
};

} // namespace lumora
