#include <LumoraKit/platform/Assert.h>
#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/linux/Backends.h>

#include <glib.h>

#include <deque>
#include <memory>
#include <mutex>
#include <utility>

#include <unistd.h>

namespace lumora::backend {
namespace {

constexpr guint conditionIntervalInMilliseconds = 5;

// The tasks travel in a queue of our own; the one source only wakes the loop. It stays attached for good and is armed
// by its ready time, so nothing is allocated in one thread and freed in another by code whose locks ThreadSanitizer
// cannot see.
class GLibMainThread final : public MainThread {
public:
  GLibMainThread();
  ~GLibMainThread() override;

  bool isCurrent() const override { return gettid() == getpid(); }
  void post(Task task) override;
  bool serveUntil(const std::function<bool()>& condition, std::chrono::milliseconds limit) override;

private:
  struct Source {
    GSource base;
    GLibMainThread* owner;
  };

  static gboolean dispatch(GSource* source, GSourceFunc, gpointer);
  Task takeNext();

  std::mutex mutex_;
  std::deque<Task> tasks_;
  GSource* source_;
};

GSource* attachedTo(GSource* source) {
  g_source_attach(source, nullptr);
  return source;
}

GLibMainThread::GLibMainThread() {
  static GSourceFuncs functions{nullptr, nullptr, &dispatch, nullptr, nullptr, nullptr};
  source_ = g_source_new(&functions, sizeof(Source));
  reinterpret_cast<Source*>(source_)->owner = this;
  g_source_set_static_name(source_, "LumoraKit main thread");
  // A task may run a loop of its own, as a modal dialog does; the tasks behind it are served there.
  g_source_set_can_recurse(source_, TRUE);
  attachedTo(source_);
}

GLibMainThread::~GLibMainThread() {
  g_source_destroy(source_);
  g_source_unref(source_);
}

void GLibMainThread::post(Task task) {
  const std::lock_guard lock(mutex_);
  tasks_.push_back(std::move(task));
  g_source_set_ready_time(source_, 0);
}

// One task a turn, so that the application's own events come in between.
gboolean GLibMainThread::dispatch(GSource* source, GSourceFunc, gpointer) {
  if (const Task task = reinterpret_cast<Source*>(source)->owner->takeNext()) {
    task();
  }
  return G_SOURCE_CONTINUE;
}

Task GLibMainThread::takeNext() {
  const std::lock_guard lock(mutex_);
  Task task;
  if (!tasks_.empty()) {
    task = std::move(tasks_.front());
    tasks_.pop_front();
  }
  g_source_set_ready_time(source_, tasks_.empty() ? -1 : 0);
  return task;
}

// Wakes the loop regularly for as long as it lives.
class Ticker {
public:
  Ticker() : source_(g_timeout_source_new(conditionIntervalInMilliseconds)) {
    g_source_set_callback(
        source_, [](gpointer) -> gboolean { return G_SOURCE_CONTINUE; }, nullptr, nullptr);
    attachedTo(source_);
  }
  ~Ticker() {
    g_source_destroy(source_);
    g_source_unref(source_);
  }
  Ticker(const Ticker&) = delete;
  Ticker& operator=(const Ticker&) = delete;

private:
  GSource* source_;
};

bool GLibMainThread::serveUntil(const std::function<bool()>& condition, std::chrono::milliseconds limit) {
  assertThat(isCurrent(), "the caller is on the main thread", "serveUntil", "MainThread");
  using Clock = std::chrono::steady_clock;
  const auto start = Clock::now();
  const Ticker ticker;
  while (!condition()) {
    if (std::chrono::duration_cast<std::chrono::milliseconds>(Clock::now() - start) >= limit) {
      return false;
    }
    g_main_context_iteration(nullptr, TRUE);
  }
  return true;
}

} // namespace

std::shared_ptr<MainThread> makeMainThread() {
  return std::make_shared<GLibMainThread>();
}

} // namespace lumora::backend
