#include "support/MainLoop.h"

#include <LumoraKit/platform/KTAction.h>
#include <LumoraKit/platform/Platform.h>
#include <LumoraKit/platform/Queues.h>

#include <gmock/gmock.h>

#include <algorithm>
#include <atomic>
#include <cstddef>
#include <filesystem>
#include <latch>
#include <memory>
#include <thread>
#include <vector>

using lumora::Platform;
using lumora::tests::serveUntil;

namespace {

std::ptrdiff_t entriesOf(const char* folder) {
  const std::filesystem::directory_iterator entries(folder);
  return std::distance(begin(entries), end(entries));
}

class ShortAction : public KTAction {
private:
  void startExecution() override { finish(); }
};

class Counter {
public:
  void ended() { ++count; }
  int count = 0;
};

// Starts actions, so many at a time, and serves until all have ended.
void runActions(int total, int atOnce) {
  const auto counter = std::make_shared<Counter>();
  for (int started = 0; started < total; started += atOnce) {
    for (int i = 0; i < atOnce; ++i) {
      const auto action = std::make_shared<ShortAction>();
      action->setFinishTarget_selector(counter, &Counter::ended);
      action->start();
    }
    ASSERT_TRUE(serveUntil([&] { return counter->count == started + atOnce; }));
  }
}

} // namespace

TEST(QueuesStress, serialQueuesAllRun_whenThreeHundredWaitForOneAnother) {
  constexpr int count = 300;
  std::vector<std::shared_ptr<lumora::WorkQueue>> queues;
  const auto together = std::make_shared<std::latch>(count);
  std::atomic<int> ended{0};
  for (int i = 0; i < count; ++i) {
    queues.push_back(Platform::current().queues->makeSerialQueue("blocking"));
    queues.back()->async([together, &ended] {
      // Returns only when every queue has got a thread.
      together->arrive_and_wait();
      ++ended;
    });
  }
  EXPECT_TRUE(serveUntil([&] { return ended == count; }));
}

TEST(QueuesStress, threadsAndDescriptorsStayFlat_whenTenThousandActionsRun) {
  constexpr int atOnce = 20;
  runActions(100, atOnce);
  const auto descriptors = entriesOf("/proc/self/fd");
  const auto threads = entriesOf("/proc/self/task");
  runActions(10000, atOnce);
  EXPECT_EQ(entriesOf("/proc/self/fd"), descriptors);
  // Every action may have had a thread of its own at one moment; never more than that.
  EXPECT_LE(entriesOf("/proc/self/task"), threads + atOnce);
}

TEST(QueuesStress, mainThreadGetsEveryTaskInOrder_whenSixtyFourThreadsPost) {
  constexpr int posters = 64;
  constexpr int each = 500;
  std::vector<std::vector<int>> received(posters);
  int total = 0;
  std::vector<std::jthread> threads;
  for (int poster = 0; poster < posters; ++poster) {
    threads.emplace_back([&, poster] {
      for (int i = 0; i < each; ++i) {
        Platform::current().mainThread->post([&, poster, i] {
          received[static_cast<std::size_t>(poster)].push_back(i);
          ++total;
        });
      }
    });
  }
  ASSERT_TRUE(serveUntil([&] { return total == posters * each; }));
  for (const auto& numbers : received) {
    EXPECT_EQ(numbers.size(), static_cast<std::size_t>(each));
    EXPECT_TRUE(std::is_sorted(numbers.begin(), numbers.end()));
  }
}

TEST(QueuesStress, mainThreadServesEveryCaller_whenSixtyFourThreadsWait) {
  constexpr int callers = 64;
  constexpr int each = 50;
  int unguarded = 0;
  std::atomic<int> left{callers};
  std::vector<std::jthread> threads;
  for (int caller = 0; caller < callers; ++caller) {
    threads.emplace_back([&] {
      for (int i = 0; i < each; ++i) {
        Platform::current().mainThread->runAndWait([&] { ++unguarded; });
      }
      --left;
    });
  }
  ASSERT_TRUE(serveUntil([&] { return left == 0; }));
  EXPECT_EQ(unguarded, callers * each);
}

TEST(QueuesStress, serialQueueKeepsItsRule_whenManyThreadsQueueAndQueuesDie) {
  std::atomic<int> ran{0};
  constexpr int makers = 16;
  constexpr int each = 200;
  {
    std::vector<std::jthread> threads;
    for (int maker = 0; maker < makers; ++maker) {
      threads.emplace_back([&] {
        for (int i = 0; i < each; ++i) {
          const auto queue = Platform::current().queues->makeSerialQueue("short-lived");
          const auto order = std::make_shared<int>(0);
          queue->async([=] { ++*order; });
          queue->async([=, &ran] { ran += ++*order == 2; });
        }
      });
    }
  }
  EXPECT_TRUE(serveUntil([&] { return ran == makers * each; }));
}
