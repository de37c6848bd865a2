#include "support/Descriptors.h"
#include "support/TemporaryFolder.h"

#include <LumoraKit/platform/linux/PosixToolRunner.h>

#include <gmock/gmock.h>

#include <atomic>
#include <cerrno>
#include <string>
#include <thread>
#include <vector>

#include <sys/stat.h>
#include <sys/wait.h>

namespace lumora::tests {
namespace {

std::string outputOf(const std::string& script, const std::string& input = "") {
  std::string output;
  std::string error;
  const int status = backend::PosixToolRunner().run("/bin/sh", {"-c", script}, input, output, error);
  return status == 0 ? output : "status " + std::to_string(status) + ": " + error;
}

// Calls the function on so many threads and waits for all.
template <class Function> void onThreads(int count, Function function) {
  std::vector<std::thread> threads;
  for (int i = 0; i < count; ++i) {
    threads.emplace_back(function, i);
  }
  for (std::thread& thread : threads) {
    thread.join();
  }
}

std::size_t leftOverChildren() {
  std::size_t count = 0;
  while (waitpid(-1, nullptr, WNOHANG) > 0) {
    ++count;
  }
  return errno == ECHILD ? count : count + 1;
}

TEST(ConcurrentRuns, giveToolsNoForeignDescriptors) {
  constexpr int rounds = 40;
  std::atomic<int> wrong{0};
  onThreads(16, [&](int) {
    for (int i = 0; i < rounds; ++i) {
      // The shell's own list: the fourth is the folder that ls reads.
      wrong += outputOf("ls /proc/self/fd | wc -l") != "4\n" ? 1 : 0;
    }
  });
  EXPECT_EQ(wrong, 0);
  EXPECT_EQ(leftOverChildren(), 0U);
}

TEST(ConcurrentRuns, answerEachCallerItsOwn) {
  std::atomic<int> wrong{0};
  onThreads(16, [&](int number) {
    const std::string input(100'000 + static_cast<std::size_t>(number), static_cast<char>('a' + number));
    for (int i = 0; i < 20; ++i) {
      wrong += outputOf("cat", input) != input ? 1 : 0;
    }
  });
  EXPECT_EQ(wrong, 0);
}

// Eight tools that end only when a pipe in the file system is opened for them, while fast ones come and go. A fast
// one would hang if a slow one held an end of its pipes.
TEST(ConcurrentRuns, endWithoutWaitingForSlowSiblings) {
  const TemporaryFolder folder;
  const auto gate = (folder / "gate").string();
  ASSERT_EQ(mkfifo(gate.c_str(), 0600), 0);
  std::atomic<int> slowEnded{0};
  std::atomic<int> wrong{0};
  onThreads(16, [&, fastLeft = std::make_shared<std::atomic<int>>(8)](int number) {
    if (number < 8) {
      wrong += outputOf(": <" + gate) != "" ? 1 : 0;
      ++slowEnded;
      return;
    }
    for (int i = 0; i < 30; ++i) {
      wrong += outputOf("cat", "input") != "input" ? 1 : 0;
    }
    if (fastLeft->fetch_sub(1) == 1) {
      wrong += slowEnded != 0 ? 1 : 0;
      // One opening serves those that wait at that moment; the last may come later.
      while (slowEnded < 8) {
        outputOf("timeout 1 sh -c ': >" + gate + "'; true");
      }
    }
  });
  EXPECT_EQ(wrong, 0);
}

TEST(ManyRuns, leaveDescriptorsAndThreadsAsTheyWere) {
  // A sanitizer starts a thread of its own with the first one.
  onThreads(1, [](int) { outputOf("cat", "input"); });
  const auto descriptors = openDescriptors();
  const auto threads = threadCount();
  std::atomic<int> wrong{0};
  onThreads(4, [&](int) {
    for (int i = 0; i < 250; ++i) {
      wrong += outputOf("cat", "input") != "input" ? 1 : 0;
    }
  });
  EXPECT_EQ(wrong, 0);
  EXPECT_EQ(openDescriptors(), descriptors);
  EXPECT_EQ(threadCount(), threads);
  EXPECT_EQ(leftOverChildren(), 0U);
}

} // namespace
} // namespace lumora::tests
