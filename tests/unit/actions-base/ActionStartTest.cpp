#include "SampleActions.h"
#include "support/MainLoop.h"

#include <LumoraKit/platform/Queues.h>

#include <gmock/gmock.h>

#include <atomic>
#include <semaphore>
#include <thread>

using lumora::Platform;
using lumora::tests::listenerOf;
using lumora::tests::SampleAction;
using lumora::tests::serveUntil;

namespace {

bool runsOnAnotherThread(const std::shared_ptr<SampleAction>& action, const std::atomic<std::thread::id>& where) {
  action->start();
  EXPECT_TRUE(serveUntil([&] { return !action->isRunning(); }));
  return where.load() != std::this_thread::get_id();
}

} // namespace

TEST(ActionStart, returnsAtOnce_whenTheExecutionBlocks) {
  std::binary_semaphore mayEnd{0};
  const auto action = SampleAction::blocking([&](SampleAction& self) {
    mayEnd.acquire();
    self.end();
  });
  action->start();
  EXPECT_TRUE(action->isRunning());
  mayEnd.release();
  EXPECT_TRUE(serveUntil([&] { return !action->isRunning(); }));
}

TEST(ActionStart, executesOnAWorker_whenTheExecutionBlocks) {
  std::atomic<std::thread::id> where;
  const auto action = SampleAction::blocking([&](SampleAction& self) {
    where = std::this_thread::get_id();
    self.end();
  });
  EXPECT_TRUE(runsOnAnotherThread(action, where));
}

TEST(ActionStart, executesOnAWorkerWithoutAQueue_whenTheExecutionBlocks) {
  std::atomic<bool> hasQueue{true};
  const auto action = SampleAction::blocking([&](SampleAction& self) {
    hasQueue = Platform::current().queues->currentQueue() != nullptr;
    self.end();
  });
  action->start();
  ASSERT_TRUE(serveUntil([&] { return !action->isRunning(); }));
  EXPECT_FALSE(hasQueue);
}

TEST(ActionStart, executesInsideStart_whenTheExecutionDoesNotBlock) {
  bool executed = false;
  const auto action = SampleAction::composite([&](SampleAction&) { executed = true; });
  action->start();
  EXPECT_TRUE(executed);
  action->end();
  EXPECT_TRUE(serveUntil([&] { return !action->isRunning(); }));
}

TEST(ActionStart, tellsObserversBeforeTheExecution_whenStarted) {
  lumora::tests::Story story;
  const auto action = SampleAction::composite([&](SampleAction&) { story.note("execution"); });
  const auto connection = action->observeRunning([&] { story.note(action->isRunning() ? "running" : "stopped"); });
  action->start();
  EXPECT_THAT(story.events, testing::ElementsAre("running", "execution"));
  EXPECT_EQ(story.thread, std::this_thread::get_id());
  action->end();
  EXPECT_TRUE(serveUntil([&] { return !action->isRunning(); }));
}

TEST(ActionStart, tellsObserversWithoutAChange_whenForced) {
  lumora::tests::Story story;
  const auto action = SampleAction::waiting();
  const auto connection = action->observeRunning([&] { story.note(action->isRunning() ? "running" : "stopped"); });
  action->notifyRunningObservers();
  EXPECT_THAT(story.events, testing::ElementsAre("stopped"));
}

TEST(ActionStart, isNotRunning_whenNotStarted) {
  EXPECT_FALSE(SampleAction::waiting()->isRunning());
}

TEST(ActionStartDeathTest, stopsTheProcess_whenStartedTwice) {
  const auto action = SampleAction::waiting();
  action->start();
  EXPECT_DEATH(action->start(), "an action is run once, in start of KTAction");
  EXPECT_DEATH(action->runSynchronously(), "an action is run once, in runSynchronously of KTAction");
  action->end();
}

TEST(ActionStartDeathTest, stopsTheProcess_whenStartedAfterTheEnd) {
  const auto action = SampleAction::succeeding();
  action->runSynchronously();
  EXPECT_DEATH(action->start(), "an action is run once, in start of KTAction");
}

TEST(ActionStart, startsItsParts_whenTheActionIsMadeOfOthers) {
  const auto part = SampleAction::failing();
  const auto listener = listenerOf(*part);
  const auto whole = SampleAction::composite([&](SampleAction& self) {
    self.runPart(part);
    listener->note("part started");
    self.end();
  });
  whole->start();
  EXPECT_TRUE(serveUntil([&] { return !part->isRunning() && !whole->isRunning(); }));
  EXPECT_THAT(listener->events, testing::ElementsAre("part started", "failed"));
}

TEST(ActionStart, carriesWhatTheCallerSet_whenEnded) {
  const auto action = SampleAction::succeeding();
  EXPECT_EQ(action->description(), "");
  EXPECT_EQ(action->userInfo(), std::nullopt);
  action->setDescription("Connecting");
  action->setUserInfo(lumora::Dictionary{{"AutomaticLogin", true}});
  action->runSynchronously();
  EXPECT_EQ(action->description(), "Connecting");
  EXPECT_EQ(action->userInfo()->find("AutomaticLogin")->boolean(), true);
}
