#pragma once

#include <LumoraKit/platform/linux/TaskSource.h>

#include <memory>

namespace lumora::backend {

/// A thread that iterates a GLib context of its own, for libraries that tell of things through one. The context is the
/// thread's default one. Any thread.
class GLibThread {
public:
  /// Null when the machine has no more threads.
  static std::unique_ptr<GLibThread> start();
  GLibThread(const GLibThread&) = delete;
  GLibThread& operator=(const GLibThread&) = delete;
  /// The thread ends after what was posted so far. Does not wait for that.
  ~GLibThread();

  void post(Task task);

private:
  struct Loop;

  explicit GLibThread(std::shared_ptr<Loop> loop);

  const std::shared_ptr<Loop> loop_;
};

} // namespace lumora::backend
