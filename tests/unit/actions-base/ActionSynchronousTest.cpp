#include "SampleActions.h"

#include <LumoraKit/platform/KTActionQueue.h>

#include <gmock/gmock.h>

#include <thread>

using lumora::tests::Listener;
using lumora::tests::listenerOf;
using lumora::tests::SampleAction;
using testing::ElementsAre;

// None of these tests serves the main thread: a synchronous run needs nobody to.

TEST(ActionSynchronous, targetIsToldBeforeTheReturn_whenTheActionFails) {
  const auto action = SampleAction::failing();
  const auto listener = listenerOf(*action);
  action->runSynchronously();
  EXPECT_THAT(listener->events, ElementsAre("failed"));
  EXPECT_EQ(action->error()->code(), 26);
  EXPECT_FALSE(action->isRunning());
}

TEST(ActionSynchronous, everythingRunsOnTheCallingThread_whenTheExecutionBlocks) {
  std::thread::id executed;
  const auto action = SampleAction::blocking([&](SampleAction& self) {
    executed = std::this_thread::get_id();
    self.end();
  });
  const auto listener = listenerOf(*action);
  action->runSynchronously();
  EXPECT_EQ(executed, std::this_thread::get_id());
  EXPECT_EQ(listener->thread, std::this_thread::get_id());
}

TEST(ActionSynchronous, endComesAfterTheExecution_whenFinishIsCalledInside) {
  std::shared_ptr<Listener> listener;
  const auto action = SampleAction::blocking([&](SampleAction& self) {
    self.end();
    listener->note("execution");
  });
  listener = listenerOf(*action);
  action->runSynchronously();
  EXPECT_THAT(listener->events, ElementsAre("execution", "finished"));
}

TEST(ActionSynchronous, comesInOneOrder_whenTheActionSucceeds) {
  const auto action = SampleAction::succeeding();
  const auto listener = listenerOf(*action);
  action->whenStopping = [&](SampleAction&) { listener->note("stopExecution"); };
  const auto connection = action->observeRunning([&] { listener->note(action->isRunning() ? "running" : "stopped"); });
  action->runSynchronously();
  EXPECT_THAT(listener->events, ElementsAre("running", "stopExecution", "stopped", "finished"));
}

TEST(ActionSynchronous, waitsAndTellsOnTheCallingThread_whenAnotherThreadFinishes) {
  std::jthread other;
  const auto action = SampleAction::composite([&](SampleAction& self) { other = std::jthread([&] { self.end(); }); });
  const auto listener = listenerOf(*action);
  action->runSynchronously();
  EXPECT_THAT(listener->events, ElementsAre("finished"));
  EXPECT_EQ(listener->thread, std::this_thread::get_id());
}

TEST(ActionSynchronous, runsItsParts_whenTheActionIsMadeOfOthers) {
  const auto part = SampleAction::failing();
  const auto listener = std::make_shared<Listener>();
  part->setErrorTarget_selector(listener, &Listener::failed);
  const auto whole = SampleAction::composite([&](SampleAction& self) {
    self.runPart(part);
    listener->note("part ended");
    self.end();
  });
  whole->setFinishTarget_selector(listener, &Listener::finished);
  whole->runSynchronously();
  EXPECT_THAT(listener->events, ElementsAre("failed", "part ended", "finished"));
}

TEST(ActionSynchronous, runsAQueueInsideAnAction_whenNobodyServesTheCaller) {
  const auto queue = KTActionQueue::queue();
  const auto member = SampleAction::succeeding();
  const auto listener = listenerOf(*member);
  queue->queueAction(member);
  const auto whole = SampleAction::composite([&](SampleAction& self) {
    self.runPart(queue);
    self.end();
  });
  whole->setFinishTarget_selector(listener, &Listener::finished);
  whole->runSynchronously();
  EXPECT_THAT(listener->events, ElementsAre("finished", "finished"));
}

TEST(ActionSynchronous, runsOnAThreadWithoutAQueue_whenCalledThere) {
  const auto action = SampleAction::succeeding();
  const auto listener = listenerOf(*action);
  std::thread::id caller;
  std::thread([&] {
    caller = std::this_thread::get_id();
    action->runSynchronously();
  }).join();
  EXPECT_THAT(listener->events, ElementsAre("finished"));
  EXPECT_EQ(listener->thread, caller);
}
