#include "stress/multiple-recorder/Loops.h"
#include "support/MainLoop.h"

#include <QCoreApplication>
#include <QElapsedTimer>
#include <QSocketNotifier>
#include <QThread>
#include <QTimer>
#include <chrono>
#include <cstdint>
#include <cstdlib>
#include <deque>
#include <memory>
#include <mutex>

#include <sys/eventfd.h>
#include <unistd.h>

namespace {

class Application {
public:
  bool serveUntil(const std::function<bool()>& condition) {
    QElapsedTimer clock;
    clock.start();
    QTimer timer;
    bool holds = false;
    QObject::connect(&timer, &QTimer::timeout, [&] {
      holds = condition();
      if (holds || clock.hasExpired(std::chrono::milliseconds(lumora::tests::generousLimit).count())) {
        QCoreApplication::quit();
      }
    });
    timer.start(std::chrono::milliseconds(2));
    QCoreApplication::exec();
    return holds;
  }

private:
  int argumentCount_ = 1;
  char name_[7] = "stress";
  char* arguments_[2] = {name_, nullptr};
  QCoreApplication application_{argumentCount_, arguments_};
};

// The main thread of a Qt program, in the way that docs/threads.md recommends. Qt is only woken: the work travels
// behind a lock that the thread sanitizer can see.
class QtMainThread final : public lumora::MainThread {
public:
  QtMainThread() {
    QObject::connect(&notifier_, &QSocketNotifier::activated, [this] { runTasks(); });
  }
  QtMainThread(const QtMainThread&) = delete;
  QtMainThread& operator=(const QtMainThread&) = delete;
  ~QtMainThread() override { ::close(wakeUp_); }

  bool isCurrent() const override { return QThread::currentThread() == notifier_.thread(); }

  void post(lumora::Task task) override {
    {
      const std::lock_guard lock(mutex_);
      tasks_.push_back(std::move(task));
    }
    ::eventfd_write(wakeUp_, 1);
  }

  bool serveUntil(const std::function<bool()>& condition, std::chrono::milliseconds) override {
    while (!condition()) {
      QCoreApplication::processEvents(QEventLoop::AllEvents, 5);
    }
    return true;
  }

private:
  void runTasks() {
    eventfd_t ignored = 0;
    ::eventfd_read(wakeUp_, &ignored);
    std::deque<lumora::Task> tasks;
    {
      const std::lock_guard lock(mutex_);
      tasks.swap(tasks_);
    }
    for (const auto& task : tasks) {
      task();
    }
  }

  const int wakeUp_ = ::eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK);
  QSocketNotifier notifier_{wakeUp_, QSocketNotifier::Read};
  std::mutex mutex_;
  std::deque<lumora::Task> tasks_;
};

bool serveWithQt(const std::function<bool()>& condition) {
  return Application().serveUntil(condition);
}

bool serveWithQtAlone(const std::function<bool()>& condition) {
  ::setenv("QT_NO_GLIB", "1", 1);
  Application application;
  const auto previous = lumora::Platform::current();
  auto platform = previous;
  platform.mainThread = std::make_shared<QtMainThread>();
  lumora::Platform::install(platform);
  const bool holds = application.serveUntil(condition);
  lumora::Platform::install(previous);
  ::unsetenv("QT_NO_GLIB");
  return holds;
}

} // namespace

Loop qtLoop() {
  return {"QtLoop", serveWithQt};
}

Loop qtLoopWithoutGLib() {
  return {"QtLoopWithoutGLib", serveWithQtAlone};
}
