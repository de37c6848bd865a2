#pragma once

#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/linux/GLibPtr.h>

#include <deque>
#include <mutex>

namespace lumora::backend {

/// Runs tasks on the thread that iterates a GLib context, in the order of the calls and one a turn. What is left when
/// it ends is dropped.
class TaskSource {
public:
  /// \param context null is GLib's default one
  explicit TaskSource(GMainContext* context);
  TaskSource(const TaskSource&) = delete;
  TaskSource& operator=(const TaskSource&) = delete;
  ~TaskSource();

  /// Any thread.
  void post(Task task);

private:
  struct Source {
    GSource base;
    TaskSource* owner;
  };

  static gboolean dispatch(GSource* source, GSourceFunc, gpointer);
  Task takeNext();

  std::mutex mutex_;
  std::deque<Task> tasks_;
  GLibPtr<GSource> source_;
};

} // namespace lumora::backend
