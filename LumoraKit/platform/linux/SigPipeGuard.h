#pragma once

#include <LumoraKit/platform/Export.h>

#include <csignal>

namespace lumora::backend {

/// While it lives, a write of this thread to a pipe without a reader raises no SIGPIPE: the signal is blocked for the
/// thread and taken off again at the end. The process's own handling of the signal is never touched, and a SIGPIPE
/// that was pending before stays pending.
class LUMORA_INTERNAL SigPipeGuard {
public:
  SigPipeGuard();
  SigPipeGuard(const SigPipeGuard&) = delete;
  SigPipeGuard& operator=(const SigPipeGuard&) = delete;
  ~SigPipeGuard();

  /// To be called after a write that failed with EPIPE: there is a signal to take off.
  void noteBrokenPipe() { brokenPipe_ = true; }

private:
  sigset_t previousMask_{};
  bool wasPending_ = false;
  bool brokenPipe_ = false;
};

} // namespace lumora::backend
