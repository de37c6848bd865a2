#include "SampleActions.h"
#include "support/MainLoop.h"

#include <LumoraKit/platform/Queues.h>

#include <gmock/gmock.h>

#include <atomic>
#include <future>
#include <thread>

using lumora::Platform;
using lumora::tests::Listener;
using lumora::tests::listenerOf;
using lumora::tests::SampleAction;
using lumora::tests::serveUntil;
using lumora::tests::waiterFor;
using testing::ElementsAre;
using testing::IsEmpty;

namespace {

void startAndServe(const KTActionRef& action, const Listener& listener) {
  action->start();
  ASSERT_TRUE(serveUntil([&] { return !listener.events.empty(); }));
}

// Lets everything run that was queued for the main thread before the call.
void serveWhatIsQueued() {
  bool reached = false;
  Platform::current().mainThread->post([&] { reached = true; });
  ASSERT_TRUE(serveUntil([&] { return reached; }));
}

} // namespace

TEST(ActionEnd, finishTargetAloneIsTold_whenThereIsNoError) {
  const auto action = SampleAction::succeeding();
  const auto listener = listenerOf(*action);
  startAndServe(action, *listener);
  EXPECT_THAT(listener->events, ElementsAre("finished"));
}

TEST(ActionEnd, errorTargetAloneIsTold_whenThereIsAnError) {
  const auto action = SampleAction::failing();
  const auto listener = listenerOf(*action);
  startAndServe(action, *listener);
  EXPECT_THAT(listener->events, ElementsAre("failed"));
  EXPECT_EQ(action->error()->code(), 26);
}

TEST(ActionEnd, finishTargetIsTold_whenTheErrorWasTakenBack) {
  const auto action = SampleAction::blocking([](SampleAction& self) {
    self.setError(SampleAction::sampleError());
    self.setError(nullptr);
    self.end();
  });
  const auto listener = listenerOf(*action);
  startAndServe(action, *listener);
  EXPECT_THAT(listener->events, ElementsAre("finished"));
}

TEST(ActionEnd, comesInOneOrder_whenTheActionFails) {
  const auto action = SampleAction::failing();
  const auto listener = listenerOf(*action);
  action->whenStopping = [&](SampleAction& self) {
    listener->note(self.error() && self.isRunning() ? "stopExecution" : "too late");
  };
  action->start();
  const auto connection = action->observeRunning([&] { listener->note(action->isRunning() ? "running" : "stopped"); });
  ASSERT_TRUE(serveUntil([&] { return listener->events.size() >= 3; }));
  EXPECT_THAT(listener->events, ElementsAre("stopExecution", "stopped", "failed"));
}

TEST(ActionEnd, outcomeStands_whenTheErrorIsSetAfterFinish) {
  const auto action = SampleAction::succeeding();
  const auto listener = listenerOf(*action);
  action->whenStopping = [](SampleAction& self) { self.setError(SampleAction::sampleError()); };
  startAndServe(action, *listener);
  EXPECT_THAT(listener->events, ElementsAre("finished"));
  EXPECT_EQ(action->error(), nullptr);
}

TEST(ActionEnd, isToldOnce_whenFinishIsCalledAgain) {
  const auto action = SampleAction::waiting();
  const auto listener = listenerOf(*action);
  action->start();
  action->end();
  action->end();
  ASSERT_TRUE(serveUntil([&] { return !listener->events.empty(); }));
  action->fail();
  serveWhatIsQueued();
  EXPECT_THAT(listener->events, ElementsAre("finished"));
}

TEST(ActionEnd, isToldOnce_whenManyThreadsFinish) {
  const auto action = SampleAction::waiting();
  const auto listener = listenerOf(*action);
  action->start();
  {
    std::vector<std::jthread> threads;
    for (int i = 0; i < 8; ++i) {
      threads.emplace_back([&] { action->end(); });
    }
  }
  serveWhatIsQueued();
  EXPECT_THAT(listener->events, ElementsAre("finished"));
}

TEST(ActionEnd, isNotTold_whenFinishComesBeforeTheStart) {
  const auto action = SampleAction::waiting();
  const auto listener = listenerOf(*action);
  action->end();
  serveWhatIsQueued();
  EXPECT_THAT(listener->events, IsEmpty());
  action->start();
  EXPECT_TRUE(action->isRunning());
  action->end();
  serveWhatIsQueued();
  EXPECT_THAT(listener->events, ElementsAre("finished"));
}

TEST(ActionEnd, comesAfterStart_whenFinishIsCalledInsideStart) {
  const auto action = SampleAction::composite(&SampleAction::end);
  const auto listener = listenerOf(*action);
  action->start();
  EXPECT_THAT(listener->events, IsEmpty());
  EXPECT_TRUE(action->isRunning());
  ASSERT_TRUE(serveUntil([&] { return !action->isRunning(); }));
  EXPECT_THAT(listener->events, ElementsAre("finished"));
}

TEST(ActionEnd, isDeliveredOnTheMainThread_whenStartedThere) {
  const auto action = SampleAction::succeeding();
  const auto listener = listenerOf(*action);
  startAndServe(action, *listener);
  EXPECT_EQ(listener->thread, std::this_thread::get_id());
}

TEST(ActionEnd, waits_whenNobodyServesTheMainThread) {
  std::promise<void> finished;
  const auto action = SampleAction::blocking([&](SampleAction& self) {
    self.end();
    finished.set_value();
  });
  const auto listener = listenerOf(*action);
  action->start();
  finished.get_future().wait();
  EXPECT_THAT(listener->events, IsEmpty());
  EXPECT_TRUE(action->isRunning());
  ASSERT_TRUE(serveUntil([&] { return !action->isRunning(); }));
  EXPECT_THAT(listener->events, ElementsAre("finished"));
}

TEST(ActionEnd, isDeliveredOnTheSerialQueue_whenStartedThere) {
  const auto& queues = Platform::current().queues;
  const auto queue = queues->makeSerialQueue("caller");
  const auto action = SampleAction::succeeding();
  const auto waiter = waiterFor(*action);
  std::shared_ptr<lumora::WorkQueue> where;
  action->whenStopping = [&](SampleAction&) { where = queues->currentQueue(); };
  queue->async([action] { action->start(); });
  waiter->wait();
  EXPECT_EQ(where, queue);
}

TEST(ActionEnd, comesAfterTheTaskThatStarted_whenStartedOnASerialQueue) {
  const auto queue = Platform::current().queues->makeSerialQueue("caller");
  const auto action = SampleAction::composite(&SampleAction::end);
  const auto waiter = waiterFor(*action);
  const auto story = std::make_shared<lumora::tests::Story>();
  action->whenStopping = [=](SampleAction&) { story->note("end"); };
  queue->async([=] {
    action->start();
    story->note("task");
  });
  waiter->wait();
  EXPECT_THAT(story->events, ElementsAre("task", "end"));
}

TEST(ActionEnd, isDeliveredOnAWorker_whenTheCallerHadNoQueue) {
  const auto action = SampleAction::composite(&SampleAction::end);
  const auto waiter = waiterFor(*action);
  std::thread::id where;
  action->whenStopping = [&](SampleAction&) { where = std::this_thread::get_id(); };
  std::jthread caller([&] { action->start(); });
  waiter->wait();
  EXPECT_NE(where, caller.get_id());
  EXPECT_NE(where, std::this_thread::get_id());
}
