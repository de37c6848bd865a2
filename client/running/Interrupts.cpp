#include "Interrupts.h"

#include "../Failure.h"

#include <atomic>
#include <csignal>
#include <cstdlib>

#include <unistd.h>

namespace lumora::client {

namespace {

std::atomic<int> received = 0;
static_assert(std::atomic<int>::is_always_lock_free);

void note(int signal) {
  int none = 0;
  received.compare_exchange_strong(none, signal);
}

} // namespace

void catchInterrupts() {
  for (const int signal : {SIGINT, SIGTERM, SIGHUP}) {
    struct sigaction before {};
    sigaction(signal, nullptr, &before);
    if (before.sa_handler != SIG_IGN) {
      struct sigaction action {};
      action.sa_handler = &note;
      sigaction(signal, &action, nullptr);
    }
  }
}

int interruptingSignal() {
  return received;
}

void throwIfInterrupted() {
  if (const int signal = received) {
    throw Interruption{signal};
  }
}

void endBySignal(int signal) {
  struct sigaction action {};
  action.sa_handler = SIG_DFL;
  sigaction(signal, &action, nullptr);
  sigset_t signals;
  sigemptyset(&signals);
  sigaddset(&signals, signal);
  sigprocmask(SIG_UNBLOCK, &signals, nullptr);
  kill(getpid(), signal);
  std::_Exit(128 + signal);
}

} // namespace lumora::client
