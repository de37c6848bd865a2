#include "support/MainLoop.h"

#include <LumoraKit/platform/Queues.h>
#include <LumoraKit/platform/linux/Backends.h>

#include <gmock/gmock.h>

#include <atomic>
#include <chrono>
#include <latch>
#include <memory>
#include <semaphore>
#include <thread>
#include <vector>

using namespace std::chrono_literals;
using lumora::WorkQueue;
using testing::ElementsAre;
using testing::IsEmpty;

namespace {

class ElasticQueues : public testing::Test {
protected:
  // Runs the work on the queue and waits for its end.
  static void runOn(WorkQueue& queue, const std::function<void()>& work) {
    const auto ended = std::make_shared<std::binary_semaphore>(0);
    queue.async([=] {
      work();
      ended->release();
    });
    ended->acquire();
  }

  bool serveUntil(const std::function<bool()>& condition) {
    return mainThread_->serveUntil(condition, lumora::tests::generousLimit);
  }

  const std::shared_ptr<lumora::MainThread> mainThread_ = lumora::backend::makeMainThread();
  const std::shared_ptr<lumora::Queues> queues_ = lumora::backend::makeQueues(mainThread_);
};

using ElasticQueuesDeathTest = ElasticQueues;

} // namespace

TEST_F(ElasticQueues, serialQueueCarriesItsLabel_whenMade) {
  EXPECT_EQ(queues_->makeSerialQueue("org.vantor.LumoraRecorder.recording")->label(),
            "org.vantor.LumoraRecorder.recording");
}

TEST_F(ElasticQueues, serialQueueRunsInTheOrderOfTheCalls_whenOneThreadCalls) {
  const auto queue = queues_->makeSerialQueue("serial");
  std::vector<int> ran;
  for (int i = 0; i < 1000; ++i) {
    queue->async([&ran, i] { ran.push_back(i); });
  }
  runOn(*queue, [] {});
  ASSERT_EQ(ran.size(), 1000U);
  EXPECT_TRUE(std::is_sorted(ran.begin(), ran.end()));
}

TEST_F(ElasticQueues, serialQueueRunsOneTaskAtATime_whenManyThreadsCall) {
  const auto queue = queues_->makeSerialQueue("serial");
  int unguarded = 0;
  {
    std::vector<std::jthread> threads;
    for (int i = 0; i < 4; ++i) {
      threads.emplace_back([&] {
        for (int k = 0; k < 250; ++k) {
          queue->async([&] { ++unguarded; });
        }
      });
    }
  }
  runOn(*queue, [] {});
  EXPECT_EQ(unguarded, 1000);
}

TEST_F(ElasticQueues, serialQueuesRunSideBySide_whenOneIsBlocked) {
  const auto blocked = queues_->makeSerialQueue("blocked");
  std::binary_semaphore go{0};
  blocked->async([&] { go.acquire(); });
  runOn(*queues_->makeSerialQueue("other"), [] {});
  go.release();
  runOn(*blocked, [] {});
}

TEST_F(ElasticQueues, serialQueueRunsItsTasks_whenItsLastOwnerDropsIt) {
  const auto ended = std::make_shared<std::binary_semaphore>(0);
  auto queue = queues_->makeSerialQueue("dropped");
  const std::weak_ptr<WorkQueue> weak = queue;
  queue->async([=] { ended->release(); });
  queue.reset();
  ended->acquire();
  EXPECT_TRUE(serveUntil([&] { return weak.expired(); }));
}

TEST_F(ElasticQueues, whatATaskHoldsDiesOnTheQueue_whenTheTaskHasRun) {
  const auto queue = queues_->makeSerialQueue("serial");
  std::binary_semaphore go{0};
  std::shared_ptr<WorkQueue> where;
  auto held = std::shared_ptr<int>(new int, [&](const int* number) {
    delete number;
    where = queues_->currentQueue();
  });
  queue->async([&] { go.acquire(); });
  queue->async([held] {});
  held.reset();
  go.release();
  runOn(*queue, [] {});
  EXPECT_EQ(where, queue);
}

TEST_F(ElasticQueues, concurrentQueuesRunAllAtOnce_whenTasksWaitForOneAnother) {
  for (const auto& queue : {queues_->concurrentQueue(), queues_->highPriorityQueue()}) {
    const auto together = std::make_shared<std::latch>(20);
    std::atomic<int> ended{0};
    for (int i = 0; i < 20; ++i) {
      queue->async([&ended, together] {
        together->arrive_and_wait();
        ++ended;
      });
    }
    EXPECT_TRUE(serveUntil([&] { return ended == 20; }));
  }
}

TEST_F(ElasticQueues, concurrentQueuesAreShared_whenAskedForAgain) {
  EXPECT_EQ(queues_->highPriorityQueue(), queues_->highPriorityQueue());
  EXPECT_EQ(queues_->concurrentQueue(), queues_->concurrentQueue());
  EXPECT_EQ(queues_->mainQueue(), queues_->mainQueue());
}

TEST_F(ElasticQueues, mainQueueRunsOnTheMainThread_whenServed) {
  std::thread::id where;
  std::thread([&] { queues_->mainQueue()->async([&] { where = std::this_thread::get_id(); }); }).join();
  EXPECT_EQ(where, std::thread::id());
  ASSERT_TRUE(serveUntil([&] { return where != std::thread::id(); }));
  EXPECT_EQ(where, std::this_thread::get_id());
}

TEST_F(ElasticQueues, currentQueueIsTheMainQueue_onTheMainThread) {
  EXPECT_EQ(queues_->currentQueue(), queues_->mainQueue());
}

TEST_F(ElasticQueues, currentQueueIsTheSerialQueue_insideItsTask) {
  const auto queue = queues_->makeSerialQueue("serial");
  std::shared_ptr<WorkQueue> current;
  runOn(*queue, [&] { current = queues_->currentQueue(); });
  EXPECT_EQ(current, queue);
}

TEST_F(ElasticQueues, currentQueueIsNull_elsewhere) {
  auto current = queues_->mainQueue();
  runOn(*queues_->concurrentQueue(), [&] { current = queues_->currentQueue(); });
  EXPECT_EQ(current, nullptr);
  current = queues_->mainQueue();
  runOn(*queues_->highPriorityQueue(), [&] { current = queues_->currentQueue(); });
  EXPECT_EQ(current, nullptr);
  current = queues_->mainQueue();
  std::thread([&] { current = queues_->currentQueue(); }).join();
  EXPECT_EQ(current, nullptr);
}

TEST_F(ElasticQueues, delayedTasksRunInTheOrderOfTheirMoments_whenQueuedInAnother) {
  const auto queue = queues_->makeSerialQueue("delayed");
  const auto ended = std::make_shared<std::binary_semaphore>(0);
  std::vector<int> ran;
  queues_->runAfter(60ms, queue, [&, ended] {
    ran.push_back(2);
    ended->release();
  });
  queues_->runAfter(1ms, queue, [&] { ran.push_back(1); });
  ended->acquire();
  EXPECT_THAT(ran, ElementsAre(1, 2));
}

TEST_F(ElasticQueues, delayedTaskRunsNotBeforeItsMoment_whenQueued) {
  const auto start = std::chrono::steady_clock::now();
  std::chrono::steady_clock::time_point ran;
  const auto ended = std::make_shared<std::binary_semaphore>(0);
  queues_->runAfter(30ms, queues_->concurrentQueue(), [&ran, ended] {
    ran = std::chrono::steady_clock::now();
    ended->release();
  });
  ended->acquire();
  EXPECT_GE(ran - start, 30ms);
}

TEST_F(ElasticQueues, delayedTaskRunsOnItsQueue_whenDue) {
  std::thread::id where;
  queues_->runAfter(1ms, queues_->mainQueue(), [&] { where = std::this_thread::get_id(); });
  ASSERT_TRUE(serveUntil([&] { return where != std::thread::id(); }));
  EXPECT_EQ(where, std::this_thread::get_id());
}

TEST_F(ElasticQueues, delayedTasksKeepTheOrderOfTheCalls_whenTheDelayIsZeroOrLess) {
  std::vector<int> ran;
  queues_->runAfter(0s, queues_->mainQueue(), [&] { ran.push_back(1); });
  queues_->runAfter(-1h, queues_->mainQueue(), [&] { ran.push_back(2); });
  queues_->runAfter(0s, queues_->mainQueue(), [&] { ran.push_back(3); });
  EXPECT_THAT(ran, IsEmpty());
  ASSERT_TRUE(serveUntil([&] { return ran.size() == 3; }));
  EXPECT_THAT(ran, ElementsAre(1, 2, 3));
}

TEST_F(ElasticQueues, delayedTaskWaits_whenTheDelayIsTheLongestThereIs) {
  queues_->runAfter(std::chrono::nanoseconds::max(), queues_->mainQueue(), [] { FAIL() << "ran"; });
  bool ran = false;
  queues_->runAfter(1ms, queues_->mainQueue(), [&] { ran = true; });
  EXPECT_TRUE(serveUntil([&] { return ran; }));
}

TEST_F(ElasticQueuesDeathTest, stopsTheProcess_whenADelayedTaskHasNoQueue) {
  EXPECT_DEATH(queues_->runAfter(1ms, nullptr, [] {}), "queue != nil, in runAfter of Queues");
}

TEST_F(ElasticQueues, delayedTaskStillRuns_whenTheQueuesDie) {
  auto queues = lumora::backend::makeQueues(mainThread_);
  bool ran = false;
  queues->runAfter(20ms, queues->mainQueue(), [&] { ran = true; });
  queues.reset();
  EXPECT_TRUE(serveUntil([&] { return ran; }));
}
