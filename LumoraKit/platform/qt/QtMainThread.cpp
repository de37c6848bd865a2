#include <LumoraKit/platform/Assert.h>
#include <LumoraKit/platform/MainThread.h>
#include <LumoraKit/platform/qt/LumoraKitQt.h>

#include <QCoreApplication>
#include <QEventLoop>
#include <QSocketNotifier>
#include <QTimer>
#include <chrono>
#include <deque>
#include <functional>
#include <mutex>
#include <utility>

#include <sys/eventfd.h>
#include <unistd.h>

namespace lumora::qt {
namespace {

constexpr auto conditionInterval = std::chrono::milliseconds(5);

// The tasks travel in a queue of our own, behind a lock that ThreadSanitizer can see; Qt is only woken, by a file
// descriptor that counts the tasks, so that no Qt object is made or touched by another thread.
class QtMainThread final : public MainThread {
public:
  QtMainThread();
  QtMainThread(const QtMainThread&) = delete;
  QtMainThread& operator=(const QtMainThread&) = delete;
  ~QtMainThread() override;

  bool isCurrent() const override { return gettid() == getpid(); }
  void post(Task task) override;
  bool serveUntil(const std::function<bool()>& condition, std::chrono::milliseconds limit) override;

private:
  void runNext();
  Task takeNext();

  const int count_ = ::eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK | EFD_SEMAPHORE);
  QSocketNotifier notifier_{count_, QSocketNotifier::Read};
  std::mutex mutex_;
  std::deque<Task> tasks_;
};

QtMainThread::QtMainThread() {
  QObject::connect(&notifier_, &QSocketNotifier::activated, &notifier_, [this] { runNext(); });
}

QtMainThread::~QtMainThread() {
  notifier_.setEnabled(false);
  ::close(count_);
}

void QtMainThread::post(Task task) {
  const std::lock_guard lock(mutex_);
  tasks_.push_back(std::move(task));
  ::eventfd_write(count_, 1);
}

// One task a turn, so that the application's own events come in between.
void QtMainThread::runNext() {
  if (const Task task = takeNext()) {
    task();
  }
}

Task QtMainThread::takeNext() {
  const std::lock_guard lock(mutex_);
  eventfd_t one = 0;
  if (::eventfd_read(count_, &one) != 0) {
    return nullptr;
  }
  Task task = std::move(tasks_.front());
  tasks_.pop_front();
  return task;
}

bool QtMainThread::serveUntil(const std::function<bool()>& condition, std::chrono::milliseconds limit) {
  assertThat(isCurrent(), "the caller is on the main thread", "serveUntil", "MainThread");
  using Clock = std::chrono::steady_clock;
  const auto start = Clock::now();
  QTimer ticker;
  ticker.start(conditionInterval);
  while (!condition()) {
    if (std::chrono::duration_cast<std::chrono::milliseconds>(Clock::now() - start) >= limit) {
      return false;
    }
    QCoreApplication::processEvents(QEventLoop::WaitForMoreEvents);
  }
  return true;
}

} // namespace

std::shared_ptr<MainThread> makeMainThread() {
  assertThat(QCoreApplication::instance() != nullptr, "there is an application", "makeMainThread", "LumoraKitQt");
  return std::make_shared<QtMainThread>();
}

} // namespace lumora::qt
