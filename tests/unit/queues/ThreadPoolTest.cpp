#include <LumoraKit/platform/linux/DelayedTasks.h>
#include <LumoraKit/platform/linux/ThreadPool.h>

#include <gmock/gmock.h>

#include <atomic>
#include <chrono>
#include <csignal>
#include <memory>
#include <mutex>
#include <semaphore>
#include <vector>

using lumora::Task;
using lumora::backend::DelayedTasks;
using lumora::backend::startThread;
using lumora::backend::ThreadPool;
using testing::ElementsAre;

namespace {

/// A machine that gives so many threads and then refuses, until it is told otherwise.
class Machine {
public:
  explicit Machine(int threads) : left_(threads) {}

  bool start(Task body) {
    if (left_.fetch_sub(1) <= 0) {
      ++left_;
      refused_.release();
      return false;
    }
    return startThread([this, body = std::move(body)] {
      body();
      ended_.release();
    });
  }
  void give(int threads) { left_ += threads; }
  void waitForEndOfAThread() { ended_.acquire(); }
  void waitForRefusal() { refused_.acquire(); }

private:
  std::atomic<int> left_;
  std::counting_semaphore<> refused_{0};
  std::counting_semaphore<> ended_{0};
};

class Pool : public testing::Test {
protected:
  void make(int threads, std::chrono::milliseconds idleTime = std::chrono::seconds(5)) {
    machine_ = std::make_shared<Machine>(threads);
    pool_ = std::make_shared<ThreadPool>(
        retries_, [machine = machine_](Task body) { return machine->start(std::move(body)); }, idleTime);
  }
  ~Pool() override { retries_->stopWhenEmpty(); }

  void post(Task task, ThreadPool::Priority priority = ThreadPool::Priority::Ordinary) {
    pool_->post(std::move(task), priority);
  }

  const std::shared_ptr<DelayedTasks> retries_ = DelayedTasks::make();
  std::shared_ptr<Machine> machine_;
  std::shared_ptr<ThreadPool> pool_;
};

} // namespace

TEST_F(Pool, runsTheTaskLater_whenThereWasNoThreadAtAll) {
  make(0);
  const auto ran = std::make_shared<std::binary_semaphore>(0);
  post([=] { ran->release(); });
  machine_->waitForRefusal();
  EXPECT_FALSE(ran->try_acquire());
  machine_->give(1);
  ran->acquire();
}

TEST_F(Pool, runsTheTaskOnAThreadThatBecomesFree_whenTheMachineGivesNoMore) {
  make(1);
  const auto go = std::make_shared<std::binary_semaphore>(0);
  const auto ran = std::make_shared<std::binary_semaphore>(0);
  post([=] { go->acquire(); });
  post([=] { ran->release(); });
  machine_->waitForRefusal();
  go->release();
  ran->acquire();
}

TEST_F(Pool, startsAThreadForAWaitingTask_whenTheOthersStayBlockedAndTheMachineGivesAgain) {
  make(1);
  const auto go = std::make_shared<std::binary_semaphore>(0);
  post([=] { go->acquire(); });
  post([=] { go->release(); });
  machine_->waitForRefusal();
  machine_->give(1);
  const auto ended = std::make_shared<std::binary_semaphore>(0);
  post([=] { ended->release(); });
  ended->acquire();
}

TEST_F(Pool, runsTasksOfHighPriorityFirst_whenThreadsAreScarce) {
  make(1);
  const auto go = std::make_shared<std::binary_semaphore>(0);
  const auto ended = std::make_shared<std::binary_semaphore>(0);
  std::vector<int> ran;
  post([=] { go->acquire(); });
  post([&] { ran.push_back(2); });
  post([&ran, ended] {
    ran.push_back(3);
    ended->release();
  });
  post([&] { ran.push_back(1); }, ThreadPool::Priority::High);
  go->release();
  ended->acquire();
  EXPECT_THAT(ran, ElementsAre(1, 2, 3));
}

TEST_F(Pool, usesAnIdleThread_whenThereIsOne) {
  make(1);
  for (int i = 0; i < 100; ++i) {
    const auto ended = std::make_shared<std::binary_semaphore>(0);
    post([=] { ended->release(); });
    ended->acquire();
  }
}

TEST_F(Pool, threadEnds_whenItHadNothingToDoForAWhile) {
  make(2, std::chrono::milliseconds(1));
  for (int i = 0; i < 2; ++i) {
    const auto ran = std::make_shared<std::binary_semaphore>(0);
    post([=] { ran->release(); });
    ran->acquire();
    machine_->waitForEndOfAThread();
  }
  // The machine has given both threads: the second task had one of its own.
  post([] {});
  machine_->waitForRefusal();
  machine_->give(1);
}

TEST_F(Pool, losesNoTask_whenTheMachineRefusesNowAndThen) {
  make(3);
  const auto ran = std::make_shared<std::counting_semaphore<>>(0);
  for (int i = 0; i < 500; ++i) {
    post([=] { ran->release(); });
  }
  for (int i = 0; i < 500; ++i) {
    ran->acquire();
  }
}

TEST_F(Pool, threadLeavesTheSignalsToTheApplication_whenStarted) {
  make(1);
  const auto asked = std::make_shared<std::binary_semaphore>(0);
  sigset_t mask;
  sigemptyset(&mask);
  post([&mask, asked] {
    pthread_sigmask(SIG_BLOCK, nullptr, &mask);
    asked->release();
  });
  asked->acquire();
  EXPECT_EQ(sigismember(&mask, SIGTERM), 1);
  EXPECT_EQ(sigismember(&mask, SIGCHLD), 1);
  EXPECT_EQ(sigismember(&mask, SIGSEGV), 0);
  sigset_t own;
  pthread_sigmask(SIG_BLOCK, nullptr, &own);
  EXPECT_EQ(sigismember(&own, SIGTERM), 0);
}
