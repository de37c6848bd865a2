#include "stress/multiple-recorder/Loops.h"
#include "support/MainLoop.h"

#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/qt/LumoraKitQt.h>

#include <QCoreApplication>
#include <QElapsedTimer>
#include <QTimer>
#include <chrono>
#include <cstdlib>

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

bool serveWithQt(const std::function<bool()>& condition) {
  return Application().serveUntil(condition);
}

bool serveWithQtAlone(const std::function<bool()>& condition) {
  ::setenv("QT_NO_GLIB", "1", 1);
  Application application;
  const auto previous = lumora::Platform::current();
  auto platform = previous;
  platform.mainThread = lumora::qt::makeMainThread();
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
