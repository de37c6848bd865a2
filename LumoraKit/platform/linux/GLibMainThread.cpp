#include <LumoraKit/platform/Assert.h>
#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/linux/Backends.h>
#include <LumoraKit/platform/linux/TaskSource.h>

#include <memory>
#include <utility>

#include <unistd.h>

namespace lumora::backend {
namespace {

constexpr guint conditionIntervalInMilliseconds = 5;

class GLibMainThread final : public MainThread {
public:
  bool isCurrent() const override { return gettid() == getpid(); }
  void post(Task task) override { tasks_.post(std::move(task)); }
  bool serveUntil(const std::function<bool()>& condition, std::chrono::milliseconds limit) override;

private:
  TaskSource tasks_{nullptr};
};

// Wakes the loop regularly for as long as it lives.
class Ticker {
public:
  Ticker() : source_(g_timeout_source_new(conditionIntervalInMilliseconds)) {
    g_source_set_callback(
        source_.get(), [](gpointer) -> gboolean { return G_SOURCE_CONTINUE; }, nullptr, nullptr);
    g_source_attach(source_.get(), nullptr);
  }

private:
  GLibPtr<GSource> source_;
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
