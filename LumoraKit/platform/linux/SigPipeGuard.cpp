#include <LumoraKit/platform/linux/SigPipeGuard.h>

#include <cerrno>
#include <ctime>

namespace lumora::backend {
namespace {

sigset_t sigPipeOnly() {
  sigset_t signals;
  sigemptyset(&signals);
  sigaddset(&signals, SIGPIPE);
  return signals;
}

} // namespace

SigPipeGuard::SigPipeGuard() {
  sigset_t pending;
  sigpending(&pending);
  wasPending_ = sigismember(&pending, SIGPIPE) == 1;
  const sigset_t signals = sigPipeOnly();
  pthread_sigmask(SIG_BLOCK, &signals, &previousMask_);
}

SigPipeGuard::~SigPipeGuard() {
  if (brokenPipe_ && !wasPending_) {
    const sigset_t signals = sigPipeOnly();
    const timespec noWait{};
    while (sigtimedwait(&signals, nullptr, &noWait) < 0 && errno == EINTR) {
    }
  }
  pthread_sigmask(SIG_SETMASK, &previousMask_, nullptr);
}

} // namespace lumora::backend
