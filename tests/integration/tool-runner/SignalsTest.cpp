#include "Helper.h"

#include <gmock/gmock.h>

#include <atomic>
#include <csignal>
#include <thread>

namespace lumora::tests {
namespace {

const std::string muchInput(1 << 20, 'x');

std::atomic<int> pipeSignals{0};

void countPipeSignal(int) {
  ++pipeSignals;
}

sigset_t threadMask() {
  sigset_t mask;
  pthread_sigmask(SIG_SETMASK, nullptr, &mask);
  return mask;
}

bool isPending(int signal) {
  sigset_t pending;
  sigpending(&pending);
  return sigismember(&pending, signal) == 1;
}

sigset_t only(int signal) {
  sigset_t set;
  sigemptyset(&set);
  sigaddset(&set, signal);
  return set;
}

TEST(BrokenPipe, raisesNoSignal_whenToolDoesNotReadItsInput) {
  pipeSignals = 0;
  struct sigaction action {};
  struct sigaction previous {};
  struct sigaction after {};
  action.sa_handler = countPipeSignal;
  sigaction(SIGPIPE, &action, &previous);
  for (int i = 0; i < 20; ++i) {
    EXPECT_EQ(run("/bin/true", {}, muchInput).status, 0);
  }
  EXPECT_FALSE(isPending(SIGPIPE));
  sigaction(SIGPIPE, &previous, &after);
  EXPECT_EQ(pipeSignals, 0);
  EXPECT_EQ(after.sa_handler, countPipeSignal);
}

TEST(BrokenPipe, leavesSignalPending_whenApplicationHasOne) {
  const sigset_t pipe = only(SIGPIPE);
  pthread_sigmask(SIG_BLOCK, &pipe, nullptr);
  raise(SIGPIPE);
  run("/bin/true", {}, muchInput);
  EXPECT_TRUE(isPending(SIGPIPE));
  EXPECT_EQ(sigismember(&pipe, SIGPIPE), 1);
  int taken = 0;
  sigwait(&pipe, &taken);
  pthread_sigmask(SIG_UNBLOCK, &pipe, nullptr);
}

TEST(ToolSignals, leaveThreadsMaskAsItWas) {
  const sigset_t user = only(SIGUSR2);
  std::thread([user] {
    pthread_sigmask(SIG_BLOCK, &user, nullptr);
    run("/bin/true", {}, muchInput);
    const sigset_t mask = threadMask();
    EXPECT_EQ(sigismember(&mask, SIGUSR2), 1);
    EXPECT_EQ(sigismember(&mask, SIGPIPE), 0);
  }).join();
}

TEST(ToolSignals, areDefaultAndOpenInTool_whenApplicationBlocksAndIgnores) {
  std::signal(SIGUSR1, SIG_IGN);
  const sigset_t user = only(SIGUSR2);
  pthread_sigmask(SIG_BLOCK, &user, nullptr);
  EXPECT_EQ(runHelper({"signals"}).output, "open default open default ");
  pthread_sigmask(SIG_UNBLOCK, &user, nullptr);
  std::signal(SIGUSR1, SIG_DFL);
}

} // namespace
} // namespace lumora::tests
