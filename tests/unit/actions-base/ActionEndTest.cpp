#include "SampleActions.h"
#include "support/MainLoop.h"

#include <LumoraKit/platform/KTActionQueue.h>

#include <gmock/gmock.h>

using lumora::tests::Listener;
using lumora::tests::SampleAction;
using lumora::tests::serveUntil;
using testing::ElementsAre;

TEST(ActionEnd, finishTargetIsTold_whenThereIsNoError) {
  const auto listener = std::make_shared<Listener>();
  const auto action = SampleAction::succeeding();
  listener->listenTo(action, listener);
  action->start();
  ASSERT_TRUE(serveUntil([&] { return !listener->told.empty(); }));
  EXPECT_THAT(listener->told, ElementsAre("finished"));
}

TEST(ActionEnd, errorTargetIsTold_whenThereIsAnError) {
  const auto listener = std::make_shared<Listener>();
  const auto action = SampleAction::failing();
  listener->listenTo(action, listener);
  action->start();
  ASSERT_TRUE(serveUntil([&] { return !listener->told.empty(); }));
  EXPECT_THAT(listener->told, ElementsAre("failed"));
}

TEST(ActionEnd, targetIsToldBeforeTheReturn_whenRunSynchronously) {
  const auto listener = std::make_shared<Listener>();
  const auto action = SampleAction::failing();
  listener->listenTo(action, listener);
  action->runSynchronously();
  EXPECT_THAT(listener->told, ElementsAre("failed"));
  EXPECT_EQ(listener->thread, std::this_thread::get_id());
}
