#include <LumoraKit/platform/linux/gstreamer/XServerLoss.h>

#include <atomic>

#include <X11/Xlib.h>
#include <unistd.h>

namespace lumora::backend {
namespace {

thread_local XServerLoss::Observer observer;

std::atomic<XIOErrorHandler> handlerBefore{nullptr};

// Xlib calls it for any connection of the process, on the thread that uses it, with no lock held. When it returns, the
// process ends.
int serverLost(Display* display) {
  if (observer) {
    // What the observer hands out must not die on this thread.
    [[maybe_unused]] const auto kept = observer();
    while (true) {
      ::pause();
    }
  }
  const XIOErrorHandler before = handlerBefore;
  return before ? before(display) : 0;
}

} // namespace

// A toolkit may have put its own handler in the place of this one meanwhile, so it is installed each time.
void XServerLoss::observe(Observer lost) {
  observer = std::move(lost);
  if (const XIOErrorHandler before = XSetIOErrorHandler(&serverLost); before != &serverLost) {
    handlerBefore = before;
  }
}

void XServerLoss::observeNoMore() {
  observer = nullptr;
}

} // namespace lumora::backend
