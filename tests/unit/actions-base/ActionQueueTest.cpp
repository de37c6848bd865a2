#include "SampleActions.h"
#include "support/MainLoop.h"

#include <LumoraKit/platform/KTActionQueue.h>
#include <LumoraKit/platform/Queues.h>

#include <gmock/gmock.h>

#include <thread>

using lumora::tests::SampleAction;
using lumora::tests::serveUntil;
using lumora::tests::Story;
using lumora::tests::waiterFor;
using testing::ElementsAre;
using testing::IsEmpty;

namespace {

/// Notes in a story what becomes of an action or a queue.
class Teller {
public:
  Teller(Story& story, std::string name) : story_(story), name_(std::move(name)) {}
  void finished() { story_.note(name_ + " finished"); }
  void failed() { story_.note(name_ + " failed"); }

private:
  Story& story_;
  const std::string name_;
};

class ActionQueue : public testing::Test {
protected:
  ActionQueue() { tell(*queue_, "queue"); }

  void tell(KTAction& action, const std::string& name) {
    const auto& teller = tellers_.emplace_back(std::make_shared<Teller>(story_, name));
    action.setFinishTarget_selector(teller, &Teller::finished);
    action.setErrorTarget_selector(teller, &Teller::failed);
  }

  void add(const std::shared_ptr<SampleAction>& action, const std::string& name) {
    tell(*action, name);
    queue_->queueAction(action);
  }

  void startAndServe() {
    queue_->start();
    ASSERT_TRUE(serveUntil([&] { return !queue_->isRunning(); }));
  }

  Story story_;
  std::vector<std::shared_ptr<Teller>> tellers_;
  const std::shared_ptr<KTActionQueue> queue_ = KTActionQueue::queue();
};

using ActionQueueDeathTest = ActionQueue;

} // namespace

TEST_F(ActionQueue, finishes_whenItIsEmpty) {
  queue_->start();
  EXPECT_THAT(story_.events, IsEmpty());
  ASSERT_TRUE(serveUntil([&] { return !queue_->isRunning(); }));
  EXPECT_THAT(story_.events, ElementsAre("queue finished"));
  EXPECT_EQ(queue_->error(), nullptr);
}

TEST_F(ActionQueue, runsItsActionsInOrderAndTellsEachTarget_whenAllSucceed) {
  for (const char* name : {"first", "second", "third"}) {
    add(SampleAction::succeeding(), name);
  }
  startAndServe();
  EXPECT_THAT(story_.events, ElementsAre("first finished", "second finished", "third finished", "queue finished"));
}

TEST_F(ActionQueue, startsAnActionAfterTheEndOfTheOneBefore_whenRunning) {
  const auto first = SampleAction::waiting();
  const auto second = SampleAction::succeeding();
  add(first, "first");
  add(second, "second");
  queue_->start();
  EXPECT_TRUE(first->isRunning());
  EXPECT_FALSE(second->isRunning());
  first->end();
  ASSERT_TRUE(serveUntil([&] { return !queue_->isRunning(); }));
  EXPECT_THAT(story_.events, ElementsAre("first finished", "second finished", "queue finished"));
}

TEST_F(ActionQueue, doesNotRunTheActionsBehind_whenOneFails) {
  const auto failing = SampleAction::failing();
  const auto behind = SampleAction::succeeding();
  add(SampleAction::succeeding(), "first");
  add(failing, "second");
  add(behind, "third");
  startAndServe();
  EXPECT_THAT(story_.events, ElementsAre("first finished", "second failed", "queue failed"));
  EXPECT_EQ(queue_->error(), failing->error());
  EXPECT_FALSE(behind->isRunning());
}

TEST_F(ActionQueue, dropsTheActionsBehind_whenOneFails) {
  auto behind = SampleAction::succeeding();
  const std::weak_ptr<SampleAction> weak = behind;
  add(SampleAction::failing(), "first");
  queue_->queueAction(std::move(behind));
  behind.reset();
  startAndServe();
  EXPECT_TRUE(weak.expired());
}

TEST_F(ActionQueue, fails_whenTheLastActionFails) {
  add(SampleAction::succeeding(), "first");
  add(SampleAction::failing(), "second");
  startAndServe();
  EXPECT_THAT(story_.events, ElementsAre("first finished", "second failed", "queue failed"));
}

TEST_F(ActionQueue, runsOnTheCallingThread_whenRunSynchronously) {
  add(SampleAction::succeeding(), "first");
  add(SampleAction::failing(), "second");
  add(SampleAction::succeeding(), "third");
  queue_->runSynchronously();
  EXPECT_THAT(story_.events, ElementsAre("first finished", "second failed", "queue failed"));
  EXPECT_EQ(story_.thread, std::this_thread::get_id());
  EXPECT_EQ(queue_->error()->code(), 26);
}

TEST_F(ActionQueue, runsAQueueOfAQueue_whenNested) {
  const auto inner = KTActionQueue::queue();
  inner->queueAction(SampleAction::failing());
  tell(*inner, "inner");
  queue_->queueAction(inner);
  startAndServe();
  EXPECT_THAT(story_.events, ElementsAre("inner failed", "queue failed"));
}

TEST_F(ActionQueue, livesUntilTheEnd_whenTheCallerDropsIt) {
  auto queue = KTActionQueue::queue();
  tell(*queue, "dropped");
  queue->queueAction(SampleAction::succeeding());
  queue->queueAction(SampleAction::succeeding());
  const std::weak_ptr<KTActionQueue> weak = queue;
  queue->start();
  queue.reset();
  ASSERT_TRUE(serveUntil([&] { return weak.expired(); }));
  EXPECT_THAT(story_.events, ElementsAre("dropped finished"));
}

TEST_F(ActionQueue, runsOnTheSerialQueue_whenStartedThere) {
  const auto& queues = lumora::Platform::current().queues;
  const auto serial = queues->makeSerialQueue("caller");
  const auto waiter = waiterFor(*queue_);
  int onCaller = 0;
  for (int i = 0; i < 3; ++i) {
    const auto action = SampleAction::succeeding();
    action->whenStopping = [&](SampleAction&) { onCaller += queues->currentQueue() == serial; };
    queue_->queueAction(action);
  }
  serial->async([queue = queue_] { queue->start(); });
  waiter->wait();
  EXPECT_EQ(onCaller, 3);
}

TEST_F(ActionQueue, runsEverythingInOrder_whenStartedOnAThreadWithoutAQueue) {
  const auto waiter = waiterFor(*queue_);
  add(SampleAction::succeeding(), "first");
  add(SampleAction::succeeding(), "second");
  std::thread([&] { queue_->start(); }).join();
  waiter->wait();
  EXPECT_THAT(story_.events, ElementsAre("first finished", "second finished"));
}

TEST_F(ActionQueue, runsThousandsOfActions_whenRunSynchronously) {
  int count = 0;
  for (int i = 0; i < 20000; ++i) {
    queue_->queueAction(SampleAction::blocking([&](SampleAction& self) {
      ++count;
      self.end();
    }));
  }
  queue_->runSynchronously();
  EXPECT_EQ(count, 20000);
}

TEST_F(ActionQueueDeathTest, stopsTheProcess_whenAnActionComesAfterTheStart) {
  queue_->runSynchronously();
  EXPECT_DEATH(queue_->queueAction(SampleAction::succeeding()),
               "the queue has not been started, in queueAction of KTActionQueue");
}

TEST_F(ActionQueueDeathTest, stopsTheProcess_whenTheActionIsAbsent) {
  EXPECT_DEATH(queue_->queueAction(nullptr), "action != nil, in queueAction of KTActionQueue");
}
