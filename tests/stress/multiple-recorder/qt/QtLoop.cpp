#include "stress/multiple-recorder/Loops.h"
#include "support/MainLoop.h"

#include <QCoreApplication>
#include <QElapsedTimer>
#include <QThread>
#include <QTimer>
#include <chrono>
#include <cstdlib>
#include <memory>

namespace {

bool serveWithQt(const std::function<bool()>& condition) {
  int argumentCount = 1;
  char name[] = "stress";
  char* arguments[] = {name, nullptr};
  QCoreApplication application(argumentCount, arguments);
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

// As docs/threads.md recommends it.
class QtMainThread final : public lumora::MainThread {
public:
  bool isCurrent() const override { return QThread::currentThread() == receiver_.thread(); }
  void post(lumora::Task task) override { QMetaObject::invokeMethod(&receiver_, task, Qt::QueuedConnection); }
  bool serveUntil(const std::function<bool()>& condition, std::chrono::milliseconds) override {
    while (!condition()) {
      QCoreApplication::processEvents(QEventLoop::AllEvents, 5);
    }
    return true;
  }

private:
  QObject receiver_; // of the thread that makes this object
};

bool serveWithQtAlone(const std::function<bool()>& condition) {
  const auto previous = lumora::Platform::current();
  auto platform = previous;
  platform.mainThread = std::make_shared<QtMainThread>();
  lumora::Platform::install(platform);
  ::setenv("QT_NO_GLIB", "1", 1);
  const bool holds = serveWithQt(condition);
  ::unsetenv("QT_NO_GLIB");
  lumora::Platform::install(previous);
  return holds;
}

} // namespace

Loop qtLoop() {
  return {"QtLoop", serveWithQt};
}

Loop qtLoopWithoutGLib() {
  return {"QtLoopWithoutGLib", serveWithQtAlone};
}
