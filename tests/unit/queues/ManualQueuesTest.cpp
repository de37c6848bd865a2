#include <LumoraKit/testing/ManualQueues.h>

#include <gmock/gmock.h>

#include <chrono>
#include <memory>
#include <thread>
#include <vector>

using namespace std::chrono_literals;
using testing::ElementsAre;
using testing::IsEmpty;

namespace {

class ManualQueues : public testing::Test {
protected:
  lumora::Task noting(int number) {
    return [this, number] { ran_.push_back(number); };
  }

  lumora::fakes::ManualQueues queues_;
  std::vector<int> ran_;
};

using ManualQueuesDeathTest = ManualQueues;

} // namespace

TEST_F(ManualQueues, nothingHappens_untilTheTestSaysSo) {
  queues_.concurrentQueue()->async(noting(1));
  queues_.makeSerialQueue("serial")->async(noting(2));
  EXPECT_EQ(queues_.pending(), 2U);
  EXPECT_THAT(ran_, IsEmpty());
  EXPECT_TRUE(queues_.runNext());
  EXPECT_THAT(ran_, ElementsAre(1));
  EXPECT_EQ(queues_.runAll(), 1U);
  EXPECT_FALSE(queues_.runNext());
  EXPECT_THAT(ran_, ElementsAre(1, 2));
}

TEST_F(ManualQueues, runsWhatTasksQueue_whenEverythingIsRun) {
  queues_.mainQueue()->async([this] { queues_.highPriorityQueue()->async(noting(1)); });
  EXPECT_EQ(queues_.runAll(), 2U);
  EXPECT_THAT(ran_, ElementsAre(1));
}

TEST_F(ManualQueues, delayedTasksRunInTheOrderOfTheirMoments_whenTheTimeMoves) {
  const auto queue = queues_.mainQueue();
  queues_.runAfter(3s, queue, noting(3));
  queues_.runAfter(1s, queue, [this, queue] {
    ran_.push_back(1);
    queues_.runAfter(1s, queue, noting(2));
  });
  queues_.runAfter(3s, queue, noting(4));
  queues_.advance(999ms);
  EXPECT_THAT(ran_, IsEmpty());
  queues_.advance(1ms);
  EXPECT_THAT(ran_, ElementsAre(1));
  queues_.advance(2s);
  EXPECT_THAT(ran_, ElementsAre(1, 2, 3, 4));
}

TEST_F(ManualQueues, delayedTaskIsQueuedAtOnce_whenTheDelayIsZero) {
  queues_.runAfter(0s, queues_.mainQueue(), noting(1));
  EXPECT_EQ(queues_.pending(), 1U);
}

TEST_F(ManualQueues, currentQueueIsTheOneOfTheTask_whenATaskRuns) {
  const auto serial = queues_.makeSerialQueue("serial");
  EXPECT_EQ(queues_.currentQueue(), queues_.mainQueue());
  serial->async([&] { EXPECT_EQ(queues_.currentQueue(), serial); });
  queues_.mainQueue()->async([&] { EXPECT_EQ(queues_.currentQueue(), queues_.mainQueue()); });
  queues_.concurrentQueue()->async([&] { EXPECT_EQ(queues_.currentQueue(), nullptr); });
  EXPECT_EQ(queues_.runAll(), 3U);
  EXPECT_EQ(queues_.currentQueue(), queues_.mainQueue());
  std::thread([&] { EXPECT_EQ(queues_.currentQueue(), nullptr); }).join();
}

TEST_F(ManualQueues, mainThreadIsTheThreadOfTheTest_always) {
  const auto mainThread = queues_.mainThread();
  EXPECT_TRUE(mainThread->isCurrent());
  std::thread([&] { EXPECT_FALSE(mainThread->isCurrent()); }).join();
  mainThread->runAndWait(noting(1));
  EXPECT_THAT(ran_, ElementsAre(1));
}

TEST_F(ManualQueues, servingRunsTasksAndMovesTheTime_untilTheConditionHolds) {
  queues_.runAfter(5s, queues_.mainQueue(), noting(1));
  queues_.runAfter(9s, queues_.mainQueue(), noting(2));
  EXPECT_TRUE(queues_.mainThread()->serveUntil([&] { return !ran_.empty(); }));
  EXPECT_THAT(ran_, ElementsAre(1));
}

TEST_F(ManualQueues, servingGivesUp_whenTheTimeIsOverOrNothingIsLeft) {
  queues_.runAfter(5s, queues_.mainQueue(), noting(1));
  EXPECT_FALSE(queues_.mainThread()->serveUntil([&] { return !ran_.empty(); }, 4999ms));
  EXPECT_FALSE(queues_.mainThread()->serveUntil([] { return false; }));
  EXPECT_THAT(ran_, ElementsAre(1));
}

TEST_F(ManualQueues, takesTasksOfOtherThreads_whenTheyQueueThem) {
  std::thread([&] { queues_.mainQueue()->async(noting(1)); }).join();
  queues_.runAll();
  EXPECT_THAT(ran_, ElementsAre(1));
}

TEST(ManualQueuesLifetime, dropsWhatWasNeverRun_whenTheObjectDies) {
  const auto life = std::make_shared<int>(0);
  {
    lumora::fakes::ManualQueues queues;
    queues.makeSerialQueue("serial")->async([life] {});
    queues.runAfter(1s, queues.mainQueue(), [life] {});
    EXPECT_EQ(life.use_count(), 3);
  }
  EXPECT_EQ(life.use_count(), 1);
}

TEST_F(ManualQueuesDeathTest, stopsTheProcess_whenADelayedTaskHasNoQueue) {
  EXPECT_DEATH(queues_.runAfter(1s, nullptr, noting(1)), "queue != nil, in runAfter of ManualQueues");
}
