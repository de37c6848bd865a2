#include <LumoraKit/platform/linux/TaskSource.h>

#include <utility>

namespace lumora::backend {

// The tasks travel in a queue of our own; the one source only wakes the loop. It stays attached for good and is armed
// by its ready time, so nothing is allocated in one thread and freed in another by code whose locks ThreadSanitizer
// cannot see.
TaskSource::TaskSource(GMainContext* context) {
  static GSourceFuncs functions{nullptr, nullptr, &dispatch, nullptr, nullptr, nullptr};
  source_.reset(g_source_new(&functions, sizeof(Source)));
  reinterpret_cast<Source*>(source_.get())->owner = this;
  g_source_set_static_name(source_.get(), "LumoraKit tasks");
  // A task may run a loop of its own, as a modal dialog does; the tasks behind it are served there.
  g_source_set_can_recurse(source_.get(), TRUE);
  g_source_attach(source_.get(), context);
}

TaskSource::~TaskSource() = default;

void TaskSource::post(Task task) {
  const std::lock_guard lock(mutex_);
  tasks_.push_back(std::move(task));
  g_source_set_ready_time(source_.get(), 0);
}

// One task a turn, so that other events come in between.
gboolean TaskSource::dispatch(GSource* source, GSourceFunc, gpointer) {
  if (const Task task = reinterpret_cast<Source*>(source)->owner->takeNext()) {
    task();
  }
  return G_SOURCE_CONTINUE;
}

Task TaskSource::takeNext() {
  const std::lock_guard lock(mutex_);
  Task task;
  if (!tasks_.empty()) {
    task = std::move(tasks_.front());
    tasks_.pop_front();
  }
  g_source_set_ready_time(source_.get(), tasks_.empty() ? -1 : 0);
  return task;
}

} // namespace lumora::backend
